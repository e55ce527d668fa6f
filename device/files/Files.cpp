#include "device/files/Files.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>

namespace nimbra::device {

namespace {

/// A file that is removed again, unless `keep` is called.
class TemporaryFile {
public:
    explicit TemporaryFile(const std::filesystem::path& target)
        : _name((target.parent_path() / ("." + target.filename().string() + ".XXXXXX")).string()),
          _descriptor(::mkostemp(_name.data(), O_CLOEXEC)) {}
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;
    ~TemporaryFile() {
        if (_descriptor.isOpen() && !_kept) {
            ::unlink(_name.c_str());
        }
    }

    [[nodiscard]] const std::string& name() const { return _name; }
    [[nodiscard]] const Descriptor& descriptor() const { return _descriptor; }
    void keep() { _kept = true; }

private:
    std::string _name;
    Descriptor _descriptor;
    bool _kept = false;
};

bool writeAll(int descriptor, std::string_view content) {
    while (!content.empty()) {
        const ssize_t written = ::write(descriptor, content.data(), content.size());
        if (written < 0 && errno != EINTR) {
            return false;
        }
        content.remove_prefix(static_cast<std::size_t>(written < 0 ? 0 : written));
    }
    return true;
}

constexpr mode_t readableByEverybody = 0644;

/// The permissions of the file at `path`, or those of a new file.
mode_t permissionsFor(const std::filesystem::path& path) {
    struct stat status{};
    return ::stat(path.c_str(), &status) == 0 ? status.st_mode & 07777U : readableByEverybody;
}

std::expected<void, Error> writeNewFile(const std::filesystem::path& path, std::string_view content,
                                        bool isFlushed) {
    const Descriptor file(
        ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, readableByEverybody));
    if (!file.isOpen() || !writeAll(file.number(), content) ||
        ::fchmod(file.number(), readableByEverybody) != 0 ||
        (isFlushed && ::fsync(file.number()) != 0)) {
        return std::unexpected(fileError(path, "cannot be written", errno));
    }
    return {};
}

std::expected<std::string, Error> readToEnd(int descriptor, const std::filesystem::path& name) {
    std::string content;
    std::array<char, 65536> buffer{};
    while (content.size() <= kMostBytesOfInput) {
        const ssize_t count = ::read(descriptor, buffer.data(), buffer.size());
        if (count > 0) {
            content.append(buffer.data(), static_cast<std::size_t>(count));
        } else if (count == 0) {
            return content;
        } else if (errno != EINTR) {
            return std::unexpected(fileError(name, "cannot be read", errno));
        }
    }
    return std::unexpected(deviceError(name.string() + ": is larger than " +
                                       std::to_string(kMostBytesOfInput) + " bytes"));
}

} // namespace

std::expected<std::string, Error> readFile(const std::filesystem::path& path) {
    const Descriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
    return file.isOpen() ? readToEnd(file.number(), path)
                         : std::unexpected(fileError(path, "cannot be read", errno));
}

std::expected<std::string, Error> readStandardInput() {
    return readToEnd(STDIN_FILENO, "standard input");
}

std::expected<void, Error> writeFileAtomically(const std::filesystem::path& path,
                                               std::string_view content,
                                               std::optional<mode_t> permissions) {
    const auto failure = [&path] {
        return std::unexpected(fileError(path, "cannot be written", errno));
    };
    TemporaryFile file(path);
    if (!file.descriptor().isOpen() || !writeAll(file.descriptor().number(), content) ||
        ::fchmod(file.descriptor().number(), permissions ? *permissions : permissionsFor(path)) !=
            0 ||
        ::fsync(file.descriptor().number()) != 0 ||
        ::rename(file.name().c_str(), path.c_str()) != 0) {
        return failure();
    }
    file.keep();
    return synchronizeDirectory(path.parent_path());
}

std::expected<void, Error> writeNewFiles(const std::filesystem::path& directory,
                                         const std::map<std::string, std::string>& files) {
    // A file that is flushed alone costs a turn of the disk. All at once cost one, and whatever
    // other programs have left to write.
    constexpr std::size_t fewFiles = 64;
    const bool areFew = files.size() <= fewFiles;
    const Descriptor descriptor(::open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!descriptor.isOpen()) {
        return std::unexpected(fileError(directory, "cannot be written", errno));
    }
    for (const auto& [name, content] : files) {
        if (auto written = writeNewFile(directory / name, content, areFew); !written) {
            return written;
        }
    }
    if (!areFew && ::syncfs(descriptor.number()) != 0) {
        return std::unexpected(fileError(directory, "cannot be flushed", errno));
    }
    return {};
}

std::expected<std::vector<std::filesystem::path>, Error>
entriesOfDirectory(const std::filesystem::path& directory) {
    std::error_code failure;
    std::vector<std::filesystem::path> entries;
    for (std::filesystem::directory_iterator entry(directory, failure), end;
         !failure && entry != end; entry.increment(failure)) {
        entries.push_back(entry->path());
    }
    if (failure) {
        return std::unexpected(fileError(directory, "cannot be read", failure.value()));
    }
    std::ranges::sort(entries);
    return entries;
}

std::expected<void, Error> synchronizeDirectory(const std::filesystem::path& directory) {
    const Descriptor descriptor(::open(directory.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (!descriptor.isOpen() || ::fsync(descriptor.number()) != 0) {
        return std::unexpected(fileError(directory, "cannot be flushed", errno));
    }
    return {};
}

} // namespace nimbra::device
