#include "host/core/scenario/RunningApplications.h"

#include "device/DeviceError.h"
#include "device/apps/ProcessRecord.h"
#include "device/files/ApplicationFileName.h"
#include "device/files/Files.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <sys/prctl.h>
#include <sys/types.h>
#include <sys/wait.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace nimbra::host {

namespace {

/// What an application's process does. Between a fork and here the program's other threads stand
/// still for good, perhaps with a lock in their hands: nothing is called that may want one.
[[noreturn]] void idle(pid_t parent) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    if (::getppid() != parent) {
        ::_exit(0); // It ended before it could be told.
    }
    // A signal is meant for the application now, and no longer for the program.
    struct sigaction usual{};
    usual.sa_handler = SIG_DFL;
    for (int signal = 1; signal < NSIG; ++signal) {
        ::sigaction(signal, &usual, nullptr);
    }
    // Whoever reads what the program writes does not have to wait for the application's end.
    ::close_range(0, ~0U, 0);
    sigset_t none;
    ::sigemptyset(&none);
    ::sigprocmask(SIG_SETMASK, &none, nullptr);
    while (true) {
        ::pause();
    }
}

struct IdleProcess {
    pid_t number;
    device::Process process;
};

/// A new process, or the errno why none can be had.
std::expected<IdleProcess, int> startIdle() {
    // Until the process has forgotten the program's handlers no signal reaches them.
    sigset_t all;
    sigset_t earlier;
    ::sigfillset(&all);
    ::pthread_sigmask(SIG_SETMASK, &all, &earlier);
    const pid_t parent = ::getpid();
    const pid_t process = ::fork();
    if (process == 0) {
        idle(parent);
    }
    const int failure = errno;
    ::pthread_sigmask(SIG_SETMASK, &earlier, nullptr);
    if (process < 0) {
        return std::unexpected(failure);
    }
    auto held = device::Process::withNumber(process);
    if (!held) {
        // It cannot be held, and nobody knows of it yet: it still has its number.
        ::kill(process, SIGKILL);
        while (::waitpid(process, nullptr, 0) < 0 && errno == EINTR) {
        }
        return std::unexpected(held.error());
    }
    return IdleProcess{.number = process, .process = std::move(*held)};
}

} // namespace

RunningApplications::RunningApplications(std::filesystem::path root) : _paths(std::move(root)) {}

RunningApplications::~RunningApplications() {
    end();
}

std::expected<void, Error>
RunningApplications::setRunning(const std::set<std::string>& identifiers) {
    const std::scoped_lock lock(_mutex);
    if (_hasEnded) {
        return {};
    }
    forgetEnded();
    std::erase_if(_processes, [&](const auto& application) {
        const bool isOver = !identifiers.contains(application.first);
        if (isOver) {
            endProcess(application.first, application.second);
        }
        return isOver;
    });
    for (const std::string& identifier : identifiers) {
        if (_processes.contains(identifier)) {
            continue;
        }
        if (auto started = start(identifier); !started) {
            return started;
        }
    }
    return {};
}

void RunningApplications::end() {
    const std::scoped_lock lock(_mutex);
    _hasEnded = true;
    for (const auto& [identifier, process] : std::exchange(_processes, {})) {
        endProcess(identifier, process);
    }
}

std::expected<void, Error> RunningApplications::start(const std::string& identifier) {
    const auto path = recordOf(identifier);
    if (!path) {
        return std::unexpected(path.error());
    }
    std::error_code failure;
    std::filesystem::create_directories(path->parent_path(), failure);
    if (failure) {
        return std::unexpected(
            device::fileError(path->parent_path(), "cannot be made", failure.value()));
    }
    auto idle = startIdle();
    if (!idle) {
        return std::unexpected(
            device::fileError(*path, "no process can be started for it", idle.error()));
    }
    const device::ProcessRecord record{.process = idle->number,
                                       .startTime = idle->process.startTime()};
    _processes.emplace(identifier, std::move(idle->process));
    return device::writeFileAtomically(*path, record.text());
}

std::expected<std::filesystem::path, Error>
RunningApplications::recordOf(const std::string& identifier) const {
    auto directory = _paths.resolve(device::kRunningApplicationsDirectory);
    if (directory) {
        *directory /= device::applicationFileName(identifier, ".pid");
    }
    return directory;
}

void RunningApplications::forgetEnded() {
    std::erase_if(_processes, [](const auto& application) {
        const bool hasEnded = application.second.awaitEnd(std::chrono::milliseconds(0));
        if (hasEnded) {
            application.second.reap();
        }
        return hasEnded;
    });
}

void RunningApplications::endProcess(const std::string& identifier,
                                     const device::Process& process) const {
    static_cast<void>(process.send(SIGKILL));
    process.reap();
    // A record that stays is one of a process that has ended, which does no harm.
    if (const auto path = recordOf(identifier)) {
        std::error_code ignored;
        std::filesystem::remove(*path, ignored);
    }
}

} // namespace nimbra::host
