#include "tests/support/PrivateBus.h"

#include "tests/device/TestFiles.h"

#include <array>
#include <csignal>
#include <cstdlib>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

namespace nimbra::test {

namespace {

constexpr const char* addressVariable = "DBUS_SESSION_BUS_ADDRESS";

/// Without services that a message could start: what the machine has installed stays out of it.
std::string configuration(const std::string& address) {
    return R"(<!DOCTYPE busconfig PUBLIC "-//freedesktop//DTD D-Bus Bus Configuration 1.0//EN"
 "http://www.freedesktop.org/standards/dbus/1.0/busconfig.dtd">
<busconfig>
  <type>session</type>
  <listen>)" +
           address + R"(</listen>
  <policy context="default">
    <allow send_destination="*"/>
    <allow receive_sender="*"/>
    <allow own="*"/>
  </policy>
</busconfig>
)";
}

} // namespace

PrivateBus::PrivateBus() {
    if (const char* earlier = std::getenv(addressVariable)) {
        _earlierAddress = earlier;
    }
    const std::string address = "unix:path=" + (_directory.path() / "bus").string();
    const auto file = _directory.path() / "bus.conf";
    writeTestFile(file, configuration(address));

    std::array<int, 2> ends{};
    EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0);
    std::string program = "dbus-daemon";
    std::string fileOption = "--config-file=" + file.string();
    std::string printOption = "--print-address";
    std::string forkOption = "--nofork";
    const std::array<char*, 5> words{program.data(), fileOption.data(), printOption.data(),
                                     forkOption.data(), nullptr};
    const pid_t test = ::getpid();
    _daemon = ::fork();
    EXPECT_GE(_daemon, 0);
    if (_daemon == 0) {
        // It does not outlive a test that is killed, also not one that has been already.
        ::prctl(PR_SET_PDEATHSIG, SIGKILL);
        if (::getppid() == test) {
            ::dup2(ends[1], STDOUT_FILENO);
            // As root without all of its powers it complains of a limit that it cannot raise.
            ::dup2(::open("/dev/null", O_WRONLY | O_CLOEXEC), STDERR_FILENO);
            ::execvp(program.c_str(), words.data());
        }
        ::_exit(1);
    }
    ::close(ends[1]);
    // It prints its address when it listens there.
    char first = '\0';
    EXPECT_EQ(::read(ends[0], &first, 1), 1);
    ::close(ends[0]);
    ::setenv(addressVariable, address.c_str(), 1);
}

PrivateBus::~PrivateBus() {
    end();
    if (_earlierAddress) {
        ::setenv(addressVariable, _earlierAddress->c_str(), 1);
    } else {
        ::unsetenv(addressVariable);
    }
}

void PrivateBus::end() {
    if (const pid_t daemon = std::exchange(_daemon, -1); daemon > 0) {
        ::kill(daemon, SIGKILL);
        ::waitpid(daemon, nullptr, 0);
    }
}

} // namespace nimbra::test
