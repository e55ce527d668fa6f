#include "device/system/NotificationFolder.h"

#include "device/DeviceError.h"
#include "device/files/Files.h"
#include "device/files/Folders.h"

#include <algorithm>
#include <atomic>
#include <cerrno>
#include <cstring>
#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>
#include <utility>

namespace nimbra::device {

namespace {

using SteadyClock = std::chrono::steady_clock;

/// The address of the socket called `name` in the open `folder`. It goes by the descriptor, as an
/// address has room for about a hundred bytes, whatever the path of the device is.
sockaddr_un addressOf(const Descriptor& folder, const std::string& name) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    const std::string path = "/proc/self/fd/" + std::to_string(folder.number()) + '/' + name;
    const std::size_t length = std::min(path.size(), sizeof address.sun_path - 1);
    std::memcpy(&address.sun_path, path.data(), length);
    return address;
}

bool fitsAddress(const std::string& name) {
    constexpr std::size_t longest = 64;
    return name.size() <= longest;
}

const sockaddr* generic(const sockaddr_un& address) {
    return reinterpret_cast<const sockaddr*>(&address); // NOLINT(*-reinterpret-cast): its purpose
}

Descriptor makeSocket() {
    return Descriptor(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0));
}

Descriptor openFolder(const std::filesystem::path& path) {
    return Descriptor(::open(path.c_str(), O_PATH | O_DIRECTORY | O_CLOEXEC));
}

bool isSocket(const Descriptor& folder, const std::string& name) {
    struct stat status{};
    return ::fstatat(folder.number(), name.c_str(), &status, AT_SYMLINK_NOFOLLOW) == 0 &&
           S_ISSOCK(status.st_mode);
}

/// Waits until `socket` may take a message, and says whether it may.
bool waitUntilWritable(const Descriptor& socket, SteadyClock::time_point latest) {
    const auto left =
        std::chrono::ceil<std::chrono::milliseconds>(latest - SteadyClock::now()).count();
    pollfd waited{.fd = socket.number(), .events = POLLOUT, .revents = 0};
    return left > 0 && (::poll(&waited, 1, static_cast<int>(left)) > 0 || errno == EINTR);
}

/// Zero, or the errno of what kept `message` from the socket at `address`.
int sendTo(const sockaddr_un& address, std::string_view message, SteadyClock::time_point latest) {
    const Descriptor socket = makeSocket();
    // Connected, so that `poll` tells whether that one has room.
    if (!socket.isOpen() || ::connect(socket.number(), generic(address), sizeof address) != 0) {
        return errno;
    }
    while (::send(socket.number(), message.data(), message.size(), MSG_NOSIGNAL) < 0) {
        const int problem = errno;
        if (problem != EINTR && (problem != EAGAIN || !waitUntilWritable(socket, latest))) {
            return problem;
        }
    }
    return 0;
}

/// Removes the socket called `name` where nobody reads from it any more, and says whether it has.
bool removeStale(const Descriptor& folder, const std::string& name) {
    const Descriptor probe = makeSocket();
    const sockaddr_un address = addressOf(folder, name);
    return probe.isOpen() && ::connect(probe.number(), generic(address), sizeof address) != 0 &&
           errno == ECONNREFUSED && ::unlinkat(folder.number(), name.c_str(), 0) == 0;
}

} // namespace

NotificationFolder::Socket::Socket(Descriptor folder, Descriptor descriptor, std::string name)
    : _folder(std::move(folder)), _descriptor(std::move(descriptor)), _name(std::move(name)) {}

NotificationFolder::Socket::~Socket() {
    if (_folder.isOpen()) {
        // A poster that found it without a reader may have been faster.
        ::unlinkat(_folder.number(), _name.c_str(), 0);
    }
}

NotificationFolder::NotificationFolder(DevicePaths paths) : _paths(std::move(paths)) {}

std::expected<NotificationFolder::Socket, Error> NotificationFolder::bind() const {
    constexpr mode_t forItsOwner = 0700;
    const auto path = makeFolder(_paths, kNotificationsDirectory, forItsOwner);
    if (!path) {
        return std::unexpected(path.error());
    }
    Descriptor folder = openFolder(*path);
    if (!folder.isOpen()) {
        return std::unexpected(fileError(*path, "cannot be opened", errno));
    }
    Descriptor socket = makeSocket();
    if (!socket.isOpen()) {
        return std::unexpected(fileError(*path, "no socket can be made", errno));
    }
    static std::atomic<unsigned> count = 0;
    constexpr int mostAttempts = 100;
    for (int attempt = 0; attempt < mostAttempts;) {
        const std::string name = std::to_string(::getpid()) + '.' + std::to_string(++count);
        const sockaddr_un address = addressOf(folder, name);
        if (::bind(socket.number(), generic(address), sizeof address) == 0) {
            return Socket(std::move(folder), std::move(socket), name);
        }
        if (errno != EADDRINUSE) {
            return std::unexpected(fileError(*path, "no socket can be bound", errno));
        }
        // Another process may have had this one's number, and left its sockets behind.
        if (!removeStale(folder, name)) {
            ++attempt;
        }
    }
    return std::unexpected(fileError(*path, "no socket can be bound", EADDRINUSE));
}

std::vector<Error> NotificationFolder::send(std::string_view message, const std::string& own,
                                            std::chrono::milliseconds patience) const {
    const auto path = _paths.resolve(kNotificationsDirectory);
    if (!path) {
        return {path.error()};
    }
    const Descriptor folder = openFolder(*path);
    if (!folder.isOpen()) {
        // Without a folder nobody has ever observed anything.
        return errno == ENOENT ? std::vector<Error>()
                               : std::vector{fileError(*path, "cannot be opened", errno)};
    }
    const auto entries = entriesOfDirectory(*path);
    if (!entries) {
        return {entries.error()};
    }
    const auto latest = SteadyClock::now() + patience;
    std::vector<Error> problems;
    for (const std::filesystem::path& entry : *entries) {
        const std::string name = entry.filename().string();
        if (name == own || !fitsAddress(name) || !isSocket(folder, name)) {
            continue;
        }
        const int problem = sendTo(addressOf(folder, name), message, latest);
        if (problem == ECONNREFUSED) {
            ::unlinkat(folder.number(), name.c_str(), 0); // its process has ended
        } else if (problem != 0 && problem != ENOENT) {
            problems.push_back(fileError(entry, "cannot be notified", problem));
        }
    }
    return problems;
}

} // namespace nimbra::device
