#include "device/files/FileStamp.h"

#include <ctime>

namespace nimbra::device {

namespace {

using std::chrono::nanoseconds;
using std::chrono::seconds;

nanoseconds sinceEpoch(const timespec& time) {
    return seconds(time.tv_sec) + nanoseconds(time.tv_nsec);
}

/// Whether what is written at `tick` or later gets another stamp than `stamp`.
bool hasSettled(const FileStamp& stamp, nanoseconds tick) {
    // Some file systems mark files in whole seconds, the coarsest in every other one.
    constexpr seconds coarsest(2);
    const bool isCoarse = stamp.changed % seconds(1) == nanoseconds::zero();
    return stamp.changed + (isCoarse ? coarsest : seconds::zero()) < tick;
}

} // namespace

FileStamp stampOf(const struct stat& status) {
    return {.device = status.st_dev,
            .inode = status.st_ino,
            .size = status.st_size,
            .modified = sinceEpoch(status.st_mtim),
            .changed = sinceEpoch(status.st_ctim)};
}

std::optional<FileStamp> stampOfPlainFile(const std::string& path) {
    struct stat status{};
    if (::lstat(path.c_str(), &status) != 0 || !S_ISREG(status.st_mode)) {
        return std::nullopt;
    }
    return stampOf(status);
}

nanoseconds fileClockNow() {
    timespec now{};
    ::clock_gettime(CLOCK_REALTIME_COARSE, &now);
    return sinceEpoch(now);
}

FileVersion::FileVersion(const FileStamp& stamp, nanoseconds tick)
    : _stamp(stamp), _hasSettled(hasSettled(stamp, tick)) {}

FileVersion FileVersion::unread(const FileStamp& stamp) {
    FileVersion version;
    version._stamp = stamp;
    return version;
}

bool FileVersion::stillHolds(const FileStamp& stamp) const {
    return _hasSettled && _stamp == stamp;
}

} // namespace nimbra::device
