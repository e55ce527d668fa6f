#pragma once

#include "platform/values/Error.h"
#include "platform/values/FileURL.h"
#include "platform/values/Text.h"

#include <expected>
#include <optional>
#include <string>
#include <sys/types.h>

namespace nimbra {

/// Under which the platform's own errors are numbered.
inline constexpr const char* PlatformErrorDomain = "PlatformErrorDomain";
/// Of that domain: the file that is meant does not exist.
inline constexpr int FileNoSuchFileError = 4;

/// How a file or folder is to be made.
struct FileAttributes {
    /// `FilePosixPermissions`: exactly these, whatever the process masks; those that are usual
    /// where none are given.
    std::optional<mode_t> posixPermissions;
};

/// The device's files, as far as the pane asks for them. Paths are absolute and the device's own; a
/// slash at the end of one says nothing. Any queue.
class FileManager {
public:
    virtual ~FileManager() = default;

    /// The directory that holds everything on the device, by the device's own name for it.
    [[nodiscard]] virtual Text SystemRootDirectory() const = 0;

    /// Stands for the cloud-document identity that is signed in; absent when there is none.
    [[nodiscard]] virtual Text tidewaterIdentityToken() = 0;

    /// Removes the file at `path`, or the folder with everything in it; of a link the link itself.
    /// Where nothing stands there the error is `FileNoSuchFileError`.
    [[nodiscard]] virtual std::expected<void, Error> removeItemAtPath(const std::string& path) = 0;

    /// Makes the folder `path`. With intermediate directories also those above it that are missing,
    /// and one that stands there already is a success; without, both are errors.
    [[nodiscard]] virtual std::expected<void, Error>
    createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        const std::string& path, bool createsIntermediates, const FileAttributes& attributes) = 0;

    /// Whether the file can be looked at now; why not is not told.
    [[nodiscard]] virtual bool isResourceReachable(const FileURL& url) = 0;

    /// What this machine's file system calls the file, for a program that is given it; nothing for
    /// one that no file system can name.
    [[nodiscard]] virtual std::optional<std::string>
    fileSystemRepresentation(const FileURL& url) = 0;
};

} // namespace nimbra
