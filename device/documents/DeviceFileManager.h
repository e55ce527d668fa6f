#pragma once

#include "device/documents/DocumentsFile.h"
#include "device/files/DevicePaths.h"
#include "device/system/PlannedOutcomes.h"
#include "platform/system/FileManager.h"

#include <vector>

namespace nimbra::device {

/// The device's files, below its root and never outside it. Errors beside the platform's own have
/// the domain "POSIX" and an errno. Any thread.
class DeviceFileManager final : public FileManager {
public:
    DeviceFileManager(DevicePaths paths, DocumentsFile documents);

    [[nodiscard]] Text SystemRootDirectory() const override;
    [[nodiscard]] Text tidewaterIdentityToken() override;
    [[nodiscard]] std::expected<void, Error> removeItemAtPath(const std::string& path) override;
    [[nodiscard]] std::expected<void, Error>
    createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        const std::string& path, bool createsIntermediates,
        const FileAttributes& attributes) override;
    [[nodiscard]] bool isResourceReachable(const FileURL& url) override;
    [[nodiscard]] std::optional<std::string> fileSystemRepresentation(const FileURL& url) override;

    /// The outcomes of the next removals, one a call and in this order: an error for one that fails
    /// and leaves the files alone. Instead of those that were planned before.
    void planRemoveOutcomes(std::vector<std::optional<Error>> outcomes);
    /// The same for folders that are made.
    void planCreateOutcomes(std::vector<std::optional<Error>> outcomes);

private:
    DevicePaths _paths;
    DocumentsFile _documents;
    PlannedOutcomes<Error> _removeOutcomes;
    PlannedOutcomes<Error> _createOutcomes;
};

} // namespace nimbra::device
