#pragma once

#include "device/files/Descriptor.h"
#include "tests/support/TemporaryDirectory.h"

#include <QString>
#include <array>
#include <cerrno>
#include <gtest/gtest.h>
#include <optional>
#include <poll.h>
#include <string>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

namespace nimbra::test {

/// Takes connections like a bus, and never says a word.
class SilentBus {
public:
    SilentBus() : _socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        sockaddr_un place{};
        place.sun_family = AF_UNIX;
        const std::string path = (_directory.path() / "bus").string();
        EXPECT_LT(path.size(), sizeof place.sun_path);
        path.copy(static_cast<char*>(place.sun_path), sizeof place.sun_path - 1);
        EXPECT_EQ(::bind(_socket.number(), reinterpret_cast<const sockaddr*>(&place), sizeof place),
                  0);
        EXPECT_EQ(::listen(_socket.number(), 1), 0);
    }

    [[nodiscard]] std::string address() const {
        return "unix:path=" + (_directory.path() / "bus").string();
    }

    /// Whether somebody waits to be taken.
    [[nodiscard]] bool hasCaller() const {
        pollfd socket{.fd = _socket.number(), .events = POLLIN, .revents = 0};
        return ::poll(&socket, 1, 0) == 1;
    }
    /// Waits for somebody to come, and keeps them.
    void take() {
        _caller.emplace(::accept(_socket.number(), nullptr, nullptr));
        EXPECT_TRUE(_caller->isOpen());
    }
    /// Whether the one that was taken still waits for a word.
    [[nodiscard]] bool isWaitedFor() const {
        return readTo(MSG_DONTWAIT) < 0 && (errno == EAGAIN || errno == EWOULDBLOCK);
    }
    /// Waits until the one that was taken goes.
    void awaitLeaving() const { EXPECT_EQ(readTo(0), 0); }

private:
    /// What comes after all that is there: 0 for the end, less for nothing.
    [[nodiscard]] ssize_t readTo(int flags) const {
        std::array<char, 256> piece{};
        ssize_t count = 0;
        do {
            count = ::recv(_caller->number(), piece.data(), piece.size(), flags);
        } while (count > 0);
        return count;
    }

    TemporaryDirectory _directory;
    device::Descriptor _socket;
    std::optional<device::Descriptor> _caller;
};

} // namespace nimbra::test
