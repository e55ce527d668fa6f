#include "device/system/DeviceDistributedNotificationCenter.h"

#include "device/DeviceError.h"
#include "device/system/Backlog.h"
#include "device/system/NotificationMessage.h"

#include <array>
#include <cerrno>
#include <functional>
#include <poll.h>
#include <pthread.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <thread>
#include <utility>
#include <vector>

namespace nimbra::device {

/// The process's socket, and the thread that waits for messages at it.
class DeviceDistributedNotificationCenter::Receiver {
public:
    /// What is to be kept until the message has been told, or dropped.
    using Delivery =
        std::function<void(std::string_view message, const std::shared_ptr<void>& held)>;

    Receiver(NotificationFolder::Socket socket, Descriptor ending, Delivery deliver)
        : _socket(std::move(socket)), _ending(std::move(ending)), _deliver(std::move(deliver)),
          _thread([this] {
              ::pthread_setname_np(::pthread_self(), "notifications");
              run();
          }) {}
    Receiver(const Receiver&) = delete;
    Receiver& operator=(const Receiver&) = delete;
    ~Receiver() {
        static_cast<void>(::eventfd_write(_ending.number(), 1));
        _thread.join();
    }

    [[nodiscard]] const std::string& socketName() const { return _socket.name(); }

private:
    void run() {
        // One byte more than the longest message shows that one is too long.
        std::vector<char> buffer(longestNotificationMessage + 1);
        std::array<pollfd, 3> waited{
            {{.fd = _socket.number(), .events = POLLIN, .revents = 0},
             {.fd = _backlog->descriptor(), .events = POLLIN, .revents = 0},
             {.fd = _ending.number(), .events = POLLIN, .revents = 0}}};
        auto& [socket, room, ending] = waited;
        while (true) {
            // One with a negative number is not looked at.
            const bool isFull = _backlog->isFull() && _backlog->descriptor() >= 0;
            socket.fd = isFull ? -1 : _socket.number();
            static_cast<void>(::poll(waited.data(), waited.size(), -1));
            if (ending.revents != 0) {
                return;
            }
            if (room.revents != 0) {
                _backlog->takeBack();
            }
            if (isFull) {
                continue;
            }
            const auto length = ::recv(_socket.number(), buffer.data(), buffer.size(), 0);
            if (length >= 0) {
                _deliver({buffer.data(), static_cast<std::size_t>(length)}, _backlog->add());
            }
        }
    }

    NotificationFolder::Socket _socket;
    Descriptor _ending;
    Delivery _deliver;
    const std::shared_ptr<Backlog> _backlog = std::make_shared<Backlog>();
    std::thread _thread;
};

DeviceDistributedNotificationCenter::DeviceDistributedNotificationCenter(
    const DevicePaths& paths, SystemLog& log, std::chrono::milliseconds patience)
    : _paths(paths), _folder(paths), _log(log), _patience(patience) {}

DeviceDistributedNotificationCenter::~DeviceDistributedNotificationCenter() {
    finish();
}

std::shared_ptr<ObserverToken>
DeviceDistributedNotificationCenter::addObserverForName(const NotificationName& name,
                                                        Observation observation) {
    if (observation.queue == nullptr) {
        _log.write(LogLevel::error,
                   oneLine("An observation has no queue; notification: " + name.string()));
        return std::make_shared<ObserverToken>();
    }
    const std::scoped_lock lock(_mutex);
    if (_isFinished) {
        return std::make_shared<ObserverToken>();
    }
    // First: from the moment at which others see the socket, nothing is missed.
    auto token = _observers.addObserverForName(name, std::move(observation));
    if (!std::exchange(_hasStarted, true)) {
        startReceiver();
    }
    return token;
}

void DeviceDistributedNotificationCenter::removeObserver(
    const std::shared_ptr<ObserverToken>& token) {
    _observers.removeObserver(token);
}

void DeviceDistributedNotificationCenter::postNotification(const Notification& notification) {
    const Notification posted = distributable(notification);
    _observers.postNotification(posted);
    const std::string message = notificationMessage(posted);
    if (message.size() > longestNotificationMessage) {
        _log.write(LogLevel::error, oneLine("A notification is too long for other processes: " +
                                            posted.name.string()));
        return;
    }
    std::string own;
    {
        const std::scoped_lock lock(_mutex);
        own = _receiver ? _receiver->socketName() : std::string();
    }
    for (const Error& problem : _folder.send(message, own, _patience)) {
        _log.write(LogLevel::error, _paths.asTheDeviceSaysIt(problem).description);
    }
}

void DeviceDistributedNotificationCenter::finish() {
    std::unique_ptr<Receiver> receiver;
    {
        const std::scoped_lock lock(_mutex);
        _isFinished = true;
        receiver = std::move(_receiver);
    }
    receiver.reset();
    _observers.removeAllObservers();
}

void DeviceDistributedNotificationCenter::startReceiver() {
    auto socket = _folder.bind();
    if (!socket) {
        _log.write(LogLevel::error, _paths.asTheDeviceSaysIt(socket.error()).description);
        return;
    }
    Descriptor ending(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK));
    if (!ending.isOpen()) {
        _log.write(LogLevel::error,
                   fileError(socket->name(), "cannot be waited at", errno).description);
        return;
    }
    _receiver = std::make_unique<Receiver>(
        std::move(*socket), std::move(ending),
        [this](std::string_view message, const std::shared_ptr<void>& held) {
            deliver(message, held);
        });
}

void DeviceDistributedNotificationCenter::deliver(std::string_view message,
                                                  const std::shared_ptr<void>& held) {
    if (message.size() > longestNotificationMessage) {
        _log.write(LogLevel::error, "A notification from another process is too long");
        return;
    }
    const auto notification = parseNotificationMessage(message);
    if (!notification) {
        _log.write(LogLevel::error, "A notification from another process cannot be read: " +
                                        notification.error().description);
        return;
    }
    _observers.postNotification(*notification, held);
}

} // namespace nimbra::device
