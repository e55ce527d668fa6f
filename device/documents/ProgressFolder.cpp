#include "device/documents/ProgressFolder.h"

#include "device/DeviceError.h"
#include "device/documents/ProgressFile.h"
#include "device/documents/ProgressPublisher.h"
#include "device/files/Files.h"
#include "device/files/Folders.h"
#include "device/files/PlainFile.h"
#include "platform/system/SystemLog.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdint>
#include <cstring>
#include <poll.h>
#include <pthread.h>
#include <string_view>
#include <sys/eventfd.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

bool isThere(const std::filesystem::path& path) {
    std::error_code failure;
    return std::filesystem::exists(std::filesystem::symlink_status(path, failure));
}

/// Among the progress of everybody, the one of the file `name`.
std::string identifierOf(const std::string& name) {
    return "progress/" + name;
}

} // namespace

ProgressFolder::ProgressFolder(DevicePaths paths, ProgressPublisher& publisher, std::string url,
                               SystemLog& log)
    : _paths(std::move(paths)), _publisher(publisher), _url(std::move(url)), _log(log) {}

ProgressFolder::~ProgressFolder() {
    finish();
}

void ProgressFolder::start() {
    if (const auto watched = makeAndWatch(); !watched) {
        report(watched.error());
        return;
    }
    const auto names = namesInFolder();
    if (!names) {
        return;
    }
    // At once: who shows a page and ends shows the sync that is under way.
    readAll(*names);
    _thread = std::thread([this] { run(); });
}

void ProgressFolder::finish() {
    if (_thread.joinable()) {
        const std::uint64_t once = 1;
        // Cannot fail: the counter is far from its end.
        static_cast<void>(::write(_end->number(), &once, sizeof once));
        _thread.join();
    }
}

std::expected<void, Error> ProgressFolder::makeAndWatch() {
    constexpr mode_t forItsOwner = 0700;
    auto directory = makeFolder(_paths, kProgressDirectory, forItsOwner);
    if (!directory) {
        return std::unexpected(directory.error());
    }
    _directory = std::move(*directory);
    _watch.emplace(::inotify_init1(IN_CLOEXEC | IN_NONBLOCK));
    _end.emplace(::eventfd(0, EFD_CLOEXEC));
    constexpr std::uint32_t events = IN_CLOSE_WRITE | IN_MOVED_TO | IN_MOVED_FROM | IN_DELETE |
                                     IN_DELETE_SELF | IN_MOVE_SELF | IN_ONLYDIR;
    if (!_watch->isOpen() || !_end->isOpen() ||
        ::inotify_add_watch(_watch->number(), _directory.c_str(), events) < 0) {
        return std::unexpected(fileError(_directory, "cannot be watched", errno));
    }
    return {};
}

void ProgressFolder::run() {
    ::pthread_setname_np(::pthread_self(), "progress-folder");
    std::array<pollfd, 2> files{pollfd{.fd = _watch->number(), .events = POLLIN, .revents = 0},
                                pollfd{.fd = _end->number(), .events = POLLIN, .revents = 0}};
    while (true) {
        if (::poll(files.data(), files.size(), -1) < 0) {
            if (errno == EINTR) {
                continue;
            }
            report(fileError(_directory, "cannot be watched", errno));
            return;
        }
        if (files[1].revents != 0 || !readEvents()) {
            return;
        }
    }
}

bool ProgressFolder::readEvents() {
    constexpr std::size_t room = 64 * (sizeof(inotify_event) + NAME_MAX + 1);
    std::array<char, room> buffer{};
    const ssize_t count = ::read(_watch->number(), buffer.data(), buffer.size());
    if (count < 0) {
        if (errno == EINTR || errno == EAGAIN) {
            return true;
        }
        report(fileError(_directory, "cannot be watched", errno));
        return false;
    }
    std::string_view events(buffer.data(), static_cast<std::size_t>(count));
    while (!events.empty()) {
        inotify_event event{};
        std::memcpy(&event, events.data(), sizeof event);
        // Behind the name, the kernel fills the event's room with zeros.
        const std::string_view padded = events.substr(sizeof event, event.len);
        const std::string name(padded.substr(0, padded.find('\0')));
        events.remove_prefix(sizeof event + event.len);
        if ((event.mask & (IN_DELETE_SELF | IN_MOVE_SELF)) != 0) {
            allGone();
            report(deviceError(_directory.string() +
                               ": has gone, and progress is not taken from it now"));
            return false;
        }
        if ((event.mask & IN_Q_OVERFLOW) != 0) {
            if (const auto names = namesInFolder()) {
                readAll(*names);
            }
        } else if ((event.mask & (IN_DELETE | IN_MOVED_FROM)) != 0) {
            fileGone(name);
        } else {
            fileChanged(name);
        }
    }
    return true;
}

std::optional<std::set<std::string>> ProgressFolder::namesInFolder() {
    const auto files = entriesOfDirectory(_directory);
    if (!files) {
        report(files.error());
        return std::nullopt;
    }
    std::set<std::string> names;
    for (const std::filesystem::path& file : *files) {
        names.insert(file.filename());
    }
    return names;
}

void ProgressFolder::readAll(const std::set<std::string>& names) {
    for (const auto& [name, values] : std::map(_published)) {
        if (!names.contains(name)) {
            fileGone(name);
        }
    }
    std::ranges::for_each(names, [this](const std::string& name) { fileChanged(name); });
}

void ProgressFolder::fileChanged(const std::string& name) {
    if (!isProgressFileName(name)) {
        return;
    }
    const std::filesystem::path path = _directory / name;
    const auto file = PlainFile::read(path, kMostBytesOfProgressFile, path);
    const auto values =
        file ? parseProgressFile(file->content, path) : std::unexpected(file.error());
    if (!values) {
        // One that has gone since is told of by an event of its own.
        if (isThere(path)) {
            reportBadFile(name, values.error());
        }
        return;
    }
    _reported.erase(name);
    const auto known = _published.find(name);
    if (known == _published.end()) {
        check(_publisher.publish(identifierOf(name), _url, *values));
        _published.emplace(name, *values);
        return;
    }
    const auto changes = ProgressChanges::between(known->second, *values);
    if (!changes.keys.empty()) {
        check(_publisher.update(identifierOf(name), changes));
        known->second = *values;
    }
}

void ProgressFolder::fileGone(const std::string& name) {
    _reported.erase(name);
    if (_published.erase(name) > 0) {
        check(_publisher.unpublish(identifierOf(name)));
    }
}

void ProgressFolder::allGone() {
    for (const auto& [name, values] : std::map(_published)) {
        fileGone(name);
    }
}

void ProgressFolder::reportBadFile(const std::string& name, const Error& error) {
    std::string& reported = _reported[name];
    if (reported != error.description) {
        reported = error.description;
        report(error);
    }
}

void ProgressFolder::report(const Error& error) {
    _log.write(LogLevel::error, _paths.asTheDeviceSaysIt(error).description);
}

void ProgressFolder::check(const std::expected<void, Error>& outcome) {
    if (!outcome) {
        report(outcome.error());
    }
}

} // namespace nimbra::device
