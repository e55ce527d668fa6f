#include "host/core/Sharing.h"

#include "device/files/Descriptor.h"
#include "device/system/SpawnSettings.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <spawn.h>
#include <sstream>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>

namespace nimbra::host {

namespace {

using Refused = std::unexpected<std::string>;
using device::Descriptor;

constexpr const char* mailProgram = "xdg-email";

Refused refused(const std::filesystem::path& path, int failure) {
    return Refused(path.string() + ": " + std::generic_category().message(failure));
}

/// A file without a place yet, beside the one that it is to become; gone with this object unless it
/// was put there.
class UnfinishedFile {
public:
    explicit UnfinishedFile(const std::filesystem::path& folder)
        : _path((folder / ".nimbra-XXXXXX").string()),
          _descriptor(::mkostemp(_path.data(), O_CLOEXEC)) {}
    UnfinishedFile(const UnfinishedFile&) = delete;
    UnfinishedFile& operator=(const UnfinishedFile&) = delete;
    ~UnfinishedFile() {
        if (_descriptor.isOpen() && !_isInPlace) {
            ::unlink(_path.c_str());
        }
    }

    [[nodiscard]] const Descriptor& descriptor() const { return _descriptor; }

    /// Puts it to `place`, where nothing stands; 0 or an errno.
    [[nodiscard]] int putTo(const std::filesystem::path& place) {
        if (::fsync(_descriptor.number()) != 0) {
            return errno;
        }
        _isInPlace =
            ::renameat2(AT_FDCWD, _path.c_str(), AT_FDCWD, place.c_str(), RENAME_NOREPLACE) == 0;
        return _isInPlace ? 0 : errno;
    }

private:
    std::string _path;
    Descriptor _descriptor;
    bool _isInPlace = false;
};

/// Writes all that can be read from `source`; 0 or an errno.
int copyContent(const Descriptor& source, const Descriptor& target) {
    constexpr std::size_t pieceSize = 65536;
    std::array<char, pieceSize> piece{};
    while (true) {
        const ssize_t count = ::read(source.number(), piece.data(), piece.size());
        if (count == 0) {
            return 0;
        }
        if (count < 0) {
            if (errno == EINTR) {
                continue;
            }
            return errno;
        }
        for (ssize_t written = 0; written < count;) {
            const ssize_t more = ::write(target.number(), piece.data() + written,
                                         static_cast<std::size_t>(count - written));
            if (more < 0 && errno != EINTR) {
                return errno;
            }
            written += std::max<ssize_t>(more, 0);
        }
    }
}

bool isProgram(const std::filesystem::path& path) {
    std::error_code ignored;
    return std::filesystem::is_regular_file(path, ignored) && ::access(path.c_str(), X_OK) == 0;
}

} // namespace

std::filesystem::path withHome(const std::string& typed) {
    // NOLINTNEXTLINE(concurrency-mt-unsafe): nobody changes the environment
    const char* const home = std::getenv("HOME");
    const bool isInHome = typed == "~" || typed.starts_with("~/");
    return isInHome && home != nullptr && *home != '\0'
               ? std::filesystem::path(home + typed.substr(1))
               : std::filesystem::path(typed);
}

std::expected<std::filesystem::path, std::string> copyFile(const std::filesystem::path& file,
                                                           const std::filesystem::path& target) {
    std::error_code failure;
    std::filesystem::path copy = std::filesystem::absolute(
        std::filesystem::is_directory(target, failure) ? target / file.filename() : target,
        failure);
    if (failure) {
        return refused(target, failure.value());
    }
    const Descriptor source(::open(file.c_str(), O_RDONLY | O_CLOEXEC));
    if (!source.isOpen()) {
        return refused(file, errno);
    }
    UnfinishedFile unfinished(copy.parent_path());
    if (!unfinished.descriptor().isOpen()) {
        return refused(copy, errno);
    }
    if (const int problem = copyContent(source, unfinished.descriptor()); problem != 0) {
        return refused(copy, problem);
    }
    if (const int problem = unfinished.putTo(copy); problem != 0) {
        return problem == EEXIST ? Refused(copy.string() + ": is there already")
                                 : refused(copy, problem);
    }
    return copy;
}

std::optional<std::filesystem::path> findMailProgram() {
    // NOLINTNEXTLINE(concurrency-mt-unsafe): nobody changes the environment
    const char* const folders = std::getenv("PATH");
    std::istringstream list(folders != nullptr ? folders : "");
    for (std::string folder; std::getline(list, folder, ':');) {
        std::filesystem::path program = std::filesystem::path(folder) / mailProgram;
        if (!folder.empty() && isProgram(program)) {
            return program;
        }
    }
    return std::nullopt;
}

std::expected<pid_t, std::string> beginMail(const std::filesystem::path& program,
                                            const std::filesystem::path& file) {
    // It may stay, and is to keep nothing of this program's.
    const device::SpawnActions actions;
    const device::SpawnAttributes attributes;
    const device::SpawnWords arguments({program.string(), "--attach", file.string()});
    pid_t process = 0;
    if (const int failure = ::posix_spawn(&process, program.c_str(), actions.get(),
                                          attributes.get(), arguments.get(), environ)) {
        return refused(program, failure);
    }
    return process;
}

std::expected<void, std::string> awaitMail(const std::filesystem::path& program, pid_t process) {
    int status = 0;
    while (::waitpid(process, &status, 0) < 0) {
        if (errno != EINTR) {
            return refused(program, errno);
        }
    }
    if (status != 0) {
        return Refused(program.string() + " could not begin a mail");
    }
    return {};
}

std::expected<void, std::string> handToMail(const std::filesystem::path& program,
                                            const std::filesystem::path& file) {
    const auto process = beginMail(program, file);
    return process ? awaitMail(program, *process) : std::unexpected(process.error());
}

} // namespace nimbra::host
