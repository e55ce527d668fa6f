#pragma once

#include "platform/system/FileManager.h"

namespace nimbra::host {

class Trace;

/// Traces what another file manager is asked to change.
class TracingFileManager final : public FileManager {
public:
    /// Neither is owned; both outlive this one.
    TracingFileManager(FileManager& files, Trace& trace) : _files(files), _trace(trace) {}

    [[nodiscard]] Text SystemRootDirectory() const override;
    [[nodiscard]] Text tidewaterIdentityToken() override;
    [[nodiscard]] std::expected<void, Error> removeItemAtPath(const std::string& path) override;
    [[nodiscard]] std::expected<void, Error>
    createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        const std::string& path, bool createsIntermediates,
        const FileAttributes& attributes) override;
    [[nodiscard]] bool isResourceReachable(const FileURL& url) override;
    [[nodiscard]] std::optional<std::string> fileSystemRepresentation(const FileURL& url) override;

private:
    FileManager& _files;
    Trace& _trace;
};

} // namespace nimbra::host
