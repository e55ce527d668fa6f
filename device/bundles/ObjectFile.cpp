#include "device/bundles/ObjectFile.h"

#include "device/DeviceError.h"
#include "device/files/Descriptor.h"

#include <algorithm>
#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <fcntl.h>
#include <link.h>
#include <span>
#include <sys/stat.h>
#include <vector>

namespace nimbra::device {

namespace {

using Header = ElfW(Ehdr);
using Segment = ElfW(Phdr);

/// Fills `bytes` from the place `offset` of `file`, as far as there is something. Gives how many
/// were read, or a negative number, with the reason in errno.
ssize_t readAt(const Descriptor& file, std::uint64_t offset, std::span<std::byte> bytes) {
    std::size_t count = 0;
    while (count < bytes.size()) {
        const std::span rest = bytes.subspan(count);
        const ssize_t read =
            ::pread(file.number(), rest.data(), rest.size(), static_cast<off_t>(offset + count));
        if (read < 0 && errno != EINTR) {
            return read;
        }
        if (read == 0) {
            break;
        }
        count += read > 0 ? static_cast<std::size_t>(read) : 0;
    }
    return static_cast<ssize_t>(count);
}

/// Whether it is the header of an object that the linker of this machine would map.
bool isOfThisMachine(const Header& header) {
    constexpr auto ourClass = sizeof(void*) == 8 ? ELFCLASS64 : ELFCLASS32;
    return std::memcmp(header.e_ident, ELFMAG, SELFMAG) == 0 &&
           header.e_ident[EI_CLASS] == ourClass && header.e_phentsize == sizeof(Segment);
}

/// Whether `count` bytes from the place `offset` on are in a file of `size` bytes.
bool isInside(std::uint64_t offset, std::uint64_t count, std::uint64_t size) {
    return offset <= size && count <= size - offset;
}

} // namespace

std::expected<void, Error> checkObjectFile(const std::filesystem::path& path,
                                           const std::string& what) {
    const auto failure = [&] { return std::unexpected(fileError(path, what, errno)); };
    const auto refusal = [&](const char* why) {
        return std::unexpected(deviceError(path.string() + ": " + what + ": " + why));
    };
    // The linker would wait for a pipe's other end.
    const Descriptor file(::open(path.c_str(), O_RDONLY | O_NONBLOCK | O_NOCTTY | O_CLOEXEC));
    struct stat status{};
    if (!file.isOpen() || ::fstat(file.number(), &status) != 0) {
        return failure();
    }
    if (S_ISDIR(status.st_mode)) {
        return refusal("is a directory");
    }
    if (!S_ISREG(status.st_mode)) {
        return refusal("is not a plain file");
    }
    const auto size = static_cast<std::uint64_t>(status.st_size);
    Header header{};
    const ssize_t found = readAt(file, 0, std::as_writable_bytes(std::span(&header, 1)));
    if (found < 0) {
        return failure();
    }
    if (static_cast<std::size_t>(found) < sizeof(header) || !isOfThisMachine(header)) {
        return {};
    }
    std::vector<Segment> segments(header.e_phnum);
    const auto table = std::as_writable_bytes(std::span(segments));
    if (!isInside(header.e_phoff, table.size(), size)) {
        return refusal("is cut off");
    }
    if (readAt(file, header.e_phoff, table) < 0) {
        return failure();
    }
    const bool isWhole = std::ranges::all_of(segments, [size](const Segment& segment) {
        return segment.p_type != PT_LOAD || isInside(segment.p_offset, segment.p_filesz, size);
    });
    return isWhole ? std::expected<void, Error>() : refusal("is cut off");
}

} // namespace nimbra::device
