#include "device/system/DeviceProcesses.h"

#include "device/files/FileOperations.h"
#include "device/system/SpawnSettings.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/wait.h>
#include <system_error>
#include <thread>
#include <unistd.h>
#include <utility>

// The header of glibc 2.36 does not say so itself.
extern "C" {
#include <sys/pidfd.h>
}

namespace nimbra::device {

struct DeviceProcesses::Child {
    Descriptor descriptor;
    /// Whether somebody waits for its end.
    bool isAwaited = false;
};

namespace {

bool hasNull(const std::string& word) {
    return word.contains('\0');
}

/// Waits until `process`, a child of this process, has ended; its status or an errno.
std::expected<int, int> statusOf(pid_t process) {
    int status = 0;
    while (::waitpid(process, &status, 0) < 0) {
        if (errno != EINTR) {
            return std::unexpected(errno);
        }
    }
    return status;
}

/// Takes the status of `process` for nobody, now or whenever it ends: one that is not taken stays
/// in the machine's table for as long as this process lives.
void forget(pid_t process) {
    if (::waitpid(process, nullptr, WNOHANG) != 0) {
        return;
    }
    try {
        std::thread([process] { static_cast<void>(statusOf(process)); }).detach();
    } catch (const std::system_error&) {
        // Without a thread it stays there, and harms nobody.
        return;
    }
}

} // namespace

DeviceProcesses::DeviceProcesses(DevicePaths paths)
    : _paths(std::move(paths)), _finishing(::eventfd(0, EFD_CLOEXEC)) {}

DeviceProcesses::~DeviceProcesses() {
    finish();
}

std::expected<pid_t, int> DeviceProcesses::posix_spawn(const SpawnRequest& request) {
    const std::scoped_lock lock(_mutex);
    if (_isFinished) {
        return std::unexpected(ECANCELED);
    }
    if (const auto planned = _spawnOutcomes.take()) {
        return std::unexpected(*planned);
    }
    if (!_finishing.isOpen()) {
        return std::unexpected(EMFILE);
    }
    const auto process = start(request);
    if (!process) {
        return process;
    }
    // As long as nobody has taken its status, the number is no other process's.
    Descriptor descriptor(::pidfd_open(*process, 0));
    if (!descriptor.isOpen()) {
        const int failure = errno;
        ::kill(*process, SIGKILL);
        static_cast<void>(statusOf(*process));
        return std::unexpected(failure);
    }
    _children.emplace(*process,
                      std::make_shared<Child>(Child{.descriptor = std::move(descriptor)}));
    return process;
}

std::expected<pid_t, int> DeviceProcesses::start(const SpawnRequest& request) const {
    std::vector<std::string> environment = request.environment.value_or(std::vector<std::string>());
    if (std::ranges::any_of(request.arguments, hasNull) ||
        std::ranges::any_of(environment, hasNull)) {
        return std::unexpected(EINVAL);
    }
    const auto program = placeOf(_paths, request.path);
    if (!program) {
        return std::unexpected(program.error());
    }
    SpawnActions actions;
    const SpawnAttributes attributes;
    for (const int failure : {actions.failure(), attributes.failure()}) {
        if (failure != 0) {
            return std::unexpected(failure);
        }
    }
    for (const SpawnFileActions::Open& open : request.fileActions.opens()) {
        const auto path = open.path == "/dev/null" ? open.path : placeOf(_paths, open.path);
        if (!path) {
            return std::unexpected(path.error());
        }
        if (const int failure = actions.open(open.descriptor, *path, open.flags, open.mode);
            failure != 0) {
            return std::unexpected(failure);
        }
    }
    const SpawnWords arguments(request.arguments);
    const SpawnWords variables(std::move(environment));
    pid_t process = -1;
    const int failure = ::posix_spawn(&process, program->c_str(), actions.get(), attributes.get(),
                                      arguments.get(), variables.get());
    return failure == 0 ? std::expected<pid_t, int>(process) : std::unexpected(failure);
}

std::expected<int, int> DeviceProcesses::waitpid(pid_t process) {
    const auto child = beginWaiting(process);
    if (!child) {
        return std::unexpected(child.error());
    }
    const int failure = awaitEnd(**child);
    const std::scoped_lock lock(_mutex);
    const auto place = _children.find(process);
    if (place == _children.end()) {
        return std::unexpected(ECANCELED);
    }
    if (failure != 0) {
        place->second->isAwaited = false;
        return std::unexpected(failure);
    }
    auto status = statusOf(process);
    _children.erase(place);
    return status;
}

std::expected<std::shared_ptr<const DeviceProcesses::Child>, int>
DeviceProcesses::beginWaiting(pid_t process) {
    const std::scoped_lock lock(_mutex);
    if (_isFinished) {
        return std::unexpected(ECANCELED);
    }
    const auto child = _children.find(process);
    if (child == _children.end() || child->second->isAwaited) {
        return std::unexpected(ECHILD);
    }
    child->second->isAwaited = true;
    return child->second;
}

/// Waits until `child` has ended or everything does; 0 or an errno.
int DeviceProcesses::awaitEnd(const Child& child) const {
    std::array<pollfd, 2> ends{
        pollfd{.fd = child.descriptor.number(), .events = POLLIN, .revents = 0},
        pollfd{.fd = _finishing.number(), .events = POLLIN, .revents = 0}};
    while (::poll(ends.data(), ends.size(), -1) < 0) {
        if (errno != EINTR) {
            return errno;
        }
    }
    return 0;
}

void DeviceProcesses::finish() {
    std::map<pid_t, std::shared_ptr<Child>> children;
    {
        const std::scoped_lock lock(_mutex);
        _isFinished = true;
        children.swap(_children);
    }
    if (_finishing.isOpen()) {
        ::eventfd_write(_finishing.number(), 1);
    }
    for (const auto& [process, child] : children) {
        // One that has ended already does not hear it.
        ::pidfd_send_signal(child->descriptor.number(), SIGTERM, nullptr, 0);
        forget(process);
    }
}

void DeviceProcesses::planSpawnOutcomes(std::vector<std::optional<int>> outcomes) {
    _spawnOutcomes.plan(std::move(outcomes));
}

} // namespace nimbra::device
