#pragma once

#include "device/files/Descriptor.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <string>

namespace nimbra::mrctl {

/// A file on its way to its place, in the same directory: hidden, and its owner's only. It is
/// locked while it is written, so that what a killed program has left can be told from it. It goes
/// with this object unless it is put in place. Only while no other thread makes files.
class TemporaryFile {
public:
    /// Makes one for `target`, whose directory exists and where nothing stands or a plain file. Its
    /// name is `prefix` and 16 hexadecimal digits; what others of such names have left in the
    /// directory is removed.
    [[nodiscard]] static std::expected<TemporaryFile, Error>
    make(const std::filesystem::path& target, const std::string& prefix);

    TemporaryFile(TemporaryFile&& other) noexcept;
    TemporaryFile& operator=(TemporaryFile&&) = delete;
    ~TemporaryFile();

    [[nodiscard]] int descriptor() const { return _file.number(); }

    /// Gives it the permissions that a new file has in this process, flushes it and renames it to
    /// its target, if there is still nothing there but a plain file.
    [[nodiscard]] std::expected<void, Error> putInPlace();

private:
    TemporaryFile(std::filesystem::path target, device::Descriptor directory);
    [[nodiscard]] bool create(const std::string& prefix);
    void removeLeftovers(const std::string& prefix) const;

    std::filesystem::path _target;
    device::Descriptor _directory;
    device::Descriptor _file{-1};
    /// In the directory; empty when nothing is to be removed.
    std::string _name;
};

} // namespace nimbra::mrctl
