#include "device/system/LogLines.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <filesystem>
#include <iterator>
#include <span>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

// Eight times what the log grows to before another file begins.
constexpr off_t mostBytes = off_t{8} * 1024 * 1024;

/// The end of the regular file at `path`, from a line's beginning on. Where that is not all, a line
/// before it says so.
std::expected<std::string, Error> endOf(const std::filesystem::path& path) {
    const auto failure = [&path](int number) {
        return std::unexpected(fileError(path, "cannot be read", number));
    };
    struct stat status{};
    if (::lstat(path.c_str(), &status) != 0) {
        return failure(errno);
    }
    // To open something else may already have an effect.
    if (S_ISDIR(status.st_mode)) {
        return failure(EISDIR);
    }
    const auto notPlain = [&path] {
        return std::unexpected(deviceError(path.string() + ": is not a plain file"));
    };
    if (!S_ISREG(status.st_mode)) {
        return notPlain();
    }
    const Descriptor file(
        ::open(path.c_str(), O_RDONLY | O_NOFOLLOW | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    if (!file.isOpen() || ::fstat(file.number(), &status) != 0) {
        return failure(errno);
    }
    if (!S_ISREG(status.st_mode)) {
        return notPlain();
    }
    const off_t start = std::max<off_t>(0, status.st_size - mostBytes);
    std::string content(static_cast<std::size_t>(status.st_size - start), '\0');
    std::size_t size = 0;
    while (size < content.size()) {
        const std::span<char> rest = std::span(content).subspan(size);
        const ssize_t count =
            ::pread(file.number(), rest.data(), rest.size(), start + static_cast<off_t>(size));
        if (count < 0 && errno != EINTR) {
            return failure(errno);
        }
        if (count == 0) {
            break; // it has become shorter since
        }
        size += static_cast<std::size_t>(std::max<ssize_t>(count, 0));
    }
    content.resize(size);
    if (start == 0) {
        return content;
    }
    // A line without its beginning could hold half a word of what is looked for in it.
    const std::size_t end = content.find('\n');
    content.erase(0, end == std::string::npos ? end : end + 1);
    const off_t leftOut = status.st_size - static_cast<off_t>(content.size());
    return "(left out here: " + std::to_string(leftOut) + " bytes)\n" + content;
}

std::vector<std::string> linesOf(std::string_view content) {
    std::vector<std::string> lines;
    while (!content.empty()) {
        const std::size_t end = content.find('\n');
        lines.push_back(oneLine(content.substr(0, end)));
        content.remove_prefix(end == std::string_view::npos ? content.size() : end + 1);
    }
    return lines;
}

} // namespace

std::expected<std::vector<std::string>, Error> newestLogLines(const DevicePaths& paths,
                                                              std::size_t most) {
    const auto path = paths.resolve(kLogFile);
    if (!path) {
        return std::unexpected(path.error());
    }
    // The newest first.
    std::array<std::filesystem::path, 3> files{*path, *path, *path};
    files[1].replace_extension(".1.log");
    files[2].replace_extension(".2.log");
    std::vector<std::string> lines;
    for (const std::filesystem::path& file : files) {
        // Each may be a link of its own, and none leads out of the device.
        const auto place = paths.resolve(
            (std::filesystem::path("/") / file.lexically_relative(paths.root())).string());
        auto content = place ? endOf(*place) : std::unexpected(place.error());
        if (!content && content.error().code == ENOENT && file != files.front()) {
            break;
        }
        if (!content) {
            return std::unexpected(content.error());
        }
        std::vector<std::string> earlier = linesOf(*content);
        earlier.insert(earlier.end(), std::make_move_iterator(lines.begin()),
                       std::make_move_iterator(lines.end()));
        lines = std::move(earlier);
        if (lines.size() >= most) {
            lines.erase(lines.begin(), lines.end() - static_cast<std::ptrdiff_t>(most));
            break;
        }
    }
    return lines;
}

} // namespace nimbra::device
