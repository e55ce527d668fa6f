#pragma once

#include <chrono>
#include <cstdint>
#include <optional>
#include <string>
#include <sys/stat.h>

namespace nimbra::device {

/// Tells one version of a file from every other, without a look at its content.
struct FileStamp {
    std::uint64_t device = 0;
    std::uint64_t inode = 0;
    std::int64_t size = 0;
    /// Since the epoch, as are all times of files here.
    std::chrono::nanoseconds modified{};
    std::chrono::nanoseconds changed{};

    friend bool operator==(const FileStamp&, const FileStamp&) = default;
};

[[nodiscard]] FileStamp stampOf(const struct stat& status);

/// The stamp of the regular file at `path`; nothing where another thing stands, a link included.
[[nodiscard]] std::optional<FileStamp> stampOfPlainFile(const std::string& path);

/// The time with which a file would be marked that is written now. It moves in ticks of some
/// milliseconds, so files written one after the other may be marked alike.
[[nodiscard]] std::chrono::nanoseconds fileClockNow();

/// The version of a file that something was made from, to know whether that still holds.
class FileVersion {
public:
    /// No version of any file.
    FileVersion() = default;
    /// The version `stamp`, which was taken, and read, no earlier than `tick` of the file clock.
    FileVersion(const FileStamp& stamp, std::chrono::nanoseconds tick);
    /// The version `stamp`, which could not be read.
    [[nodiscard]] static FileVersion unread(const FileStamp& stamp);

    /// Whether what was read is what a file says whose stamp is now `stamp`. False also while the
    /// file may have changed after it was read without a change of its stamp.
    [[nodiscard]] bool stillHolds(const FileStamp& stamp) const;

    /// The stamp; nothing where there is no version.
    [[nodiscard]] const std::optional<FileStamp>& stamp() const { return _stamp; }

    /// From now on it does not hold what was made: it is to be read again.
    void forget() { _hasSettled = false; }

private:
    std::optional<FileStamp> _stamp;
    /// Whether every later change of the file shows in its stamp.
    bool _hasSettled = false;
};

} // namespace nimbra::device
