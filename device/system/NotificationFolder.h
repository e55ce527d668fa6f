#pragma once

#include "device/files/Descriptor.h"
#include "device/files/DevicePaths.h"
#include "platform/values/Error.h"

#include <chrono>
#include <expected>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::device {

/// The folder in which every process of a device that observes distributed notifications has a
/// datagram socket. Any thread.
class NotificationFolder {
public:
    /// A socket in the folder, which goes with this object.
    class Socket {
    public:
        Socket(Descriptor folder, Descriptor descriptor, std::string name);
        Socket(Socket&& other) noexcept = default;
        Socket(const Socket&) = delete;
        Socket& operator=(const Socket&) = delete;
        Socket& operator=(Socket&&) = delete;
        ~Socket();

        [[nodiscard]] const std::string& name() const { return _name; }
        [[nodiscard]] int number() const { return _descriptor.number(); }

    private:
        Descriptor _folder;
        Descriptor _descriptor;
        std::string _name;
    };

    explicit NotificationFolder(DevicePaths paths);

    /// A new socket of this process; the folder is made where there is none, for its owner only.
    [[nodiscard]] std::expected<Socket, Error> bind() const;

    /// Sends `message` to every socket in the folder but the one called `own`, and removes those
    /// whose process is gone. Waits no longer than `patience` in all for processes that do not
    /// keep up. Gives back what went wrong; one socket's trouble keeps no other from the message.
    [[nodiscard]] std::vector<Error> send(std::string_view message, const std::string& own,
                                          std::chrono::milliseconds patience) const;

private:
    DevicePaths _paths;
};

} // namespace nimbra::device
