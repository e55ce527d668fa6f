#include "host/core/scenario/TerminationGuard.h"

#include <atomic>
#include <cerrno>
#include <sys/eventfd.h>
#include <unistd.h>
#include <utility>

namespace nimbra::host {

namespace {

// A signal handler can reach nothing but what is global.
std::atomic<int> wakeUpDescriptor = -1;
std::atomic<int> arrivedSignal = 0;
static_assert(std::atomic<int>::is_always_lock_free, "a signal handler may wait for nobody");

extern "C" void noteSignal(int signal) {
    const int error = errno;
    arrivedSignal = signal;
    static_cast<void>(::eventfd_write(wakeUpDescriptor, 1));
    errno = error;
}

void waitForWakeUp() {
    eventfd_t count = 0;
    while (::eventfd_read(wakeUpDescriptor, &count) < 0 && errno == EINTR) {
    }
}

void endWithSignal(int number) {
    std::signal(number, SIG_DFL); // NOLINT(cert-err33-c): there is nothing left to be done about it
    ::kill(::getpid(), number);
}

} // namespace

TerminationGuard::TerminationGuard(std::function<void()> putInOrder) {
    arrivedSignal = 0;
    // Never closed: a handler that another thread has begun may write to it late.
    if (wakeUpDescriptor < 0) {
        wakeUpDescriptor = ::eventfd(0, EFD_CLOEXEC);
    }
    _thread = std::thread([putInOrder = std::move(putInOrder)] {
        waitForWakeUp();
        if (const int number = arrivedSignal; number != 0) {
            putInOrder();
            endWithSignal(number);
        }
    });
    struct sigaction action{};
    action.sa_handler = noteSignal;
    action.sa_flags = SA_RESTART;
    for (std::size_t index = 0; index < _signals.size(); ++index) {
        ::sigaction(_signals.at(index), nullptr, &_earlier.at(index));
        // A signal that whoever started the program wants ignored stays so.
        if (_earlier.at(index).sa_handler != SIG_IGN) {
            ::sigaction(_signals.at(index), &action, nullptr);
        }
    }
}

TerminationGuard::~TerminationGuard() {
    for (std::size_t index = 0; index < _signals.size(); ++index) {
        ::sigaction(_signals.at(index), &_earlier.at(index), nullptr);
    }
    static_cast<void>(::eventfd_write(wakeUpDescriptor, 1));
    _thread.join();
}

} // namespace nimbra::host
