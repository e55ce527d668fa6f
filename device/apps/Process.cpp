#include "device/apps/Process.h"

#include "device/files/Files.h"

#include <algorithm>
#include <cerrno>
#include <limits>
#include <poll.h>
#include <sstream>
#include <string>
#include <sys/types.h>
#include <sys/wait.h>
#include <utility>

// The header of glibc 2.36 does not say so itself.
extern "C" {
#include <sys/pidfd.h>
}

namespace nimbra::device {

std::expected<Process, int> Process::withNumber(pid_t number) {
    Descriptor descriptor(::pidfd_open(number, 0));
    if (!descriptor.isOpen()) {
        return std::unexpected(errno);
    }
    return Process(number, std::move(descriptor));
}

Process::Process(pid_t number, Descriptor descriptor)
    : _number(number), _descriptor(std::move(descriptor)) {}

std::optional<std::uint64_t> Process::startTime() const {
    const auto stat = readFile("/proc/" + std::to_string(_number) + "/stat");
    if (!stat) {
        return std::nullopt;
    }
    // The second field is the program's name in parentheses, which may itself hold blanks and
    // parentheses: the third one starts behind the last of them.
    const auto nameEnd = stat->rfind(')');
    if (nameEnd == std::string::npos) {
        return std::nullopt;
    }
    std::istringstream fields(stat->substr(nameEnd + 1));
    constexpr int fieldsBetween = 19;
    std::string skipped;
    for (int field = 0; field < fieldsBetween; ++field) {
        fields >> skipped;
    }
    std::uint64_t startTime = 0;
    return fields >> startTime ? std::optional(startTime) : std::nullopt;
}

bool Process::awaitEnd(std::chrono::milliseconds longest) const {
    using Clock = std::chrono::steady_clock;
    const auto latest = Clock::now() + longest;
    pollfd ending{.fd = _descriptor.number(), .events = POLLIN, .revents = 0};
    while (true) {
        const auto left = std::chrono::ceil<std::chrono::milliseconds>(latest - Clock::now());
        const auto time =
            std::clamp<std::int64_t>(left.count(), 0, std::numeric_limits<int>::max());
        const int count = ::poll(&ending, 1, static_cast<int>(time));
        if (count >= 0 || errno != EINTR) {
            return count > 0;
        }
    }
}

std::expected<void, int> Process::send(int signal) const {
    if (::pidfd_send_signal(_descriptor.number(), signal, nullptr, 0) != 0) {
        return std::unexpected(errno);
    }
    return {};
}

void Process::reap() const {
    siginfo_t ignored{};
    const auto descriptor = static_cast<id_t>(_descriptor.number());
    while (::waitid(P_PIDFD, descriptor, &ignored, WEXITED) != 0 && errno == EINTR) {
    }
}

} // namespace nimbra::device
