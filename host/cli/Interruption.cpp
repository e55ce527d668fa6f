#include "host/cli/Interruption.h"

#include <atomic>
#include <cerrno>
#include <sys/eventfd.h>

namespace nimbra::cli {

namespace {

// A signal handler can reach nothing but what is global. It may run on any thread, so that no call
// of the main thread is sure to be interrupted by it.
std::atomic<int> interruptionDescriptor = -1;
static_assert(std::atomic<int>::is_always_lock_free, "a signal handler may wait for nobody");

extern "C" void noteInterruption(int /*signal*/) {
    const int error = errno;
    static_cast<void>(::eventfd_write(interruptionDescriptor, 1));
    errno = error;
}

} // namespace

Interruption::Interruption(std::initializer_list<int> signals) {
    // Never closed: a handler that another thread has begun may write to it late.
    if (interruptionDescriptor < 0) {
        interruptionDescriptor = ::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK);
    }
    eventfd_t earlier = 0;
    static_cast<void>(::eventfd_read(interruptionDescriptor, &earlier));
    struct sigaction action{};
    action.sa_handler = noteInterruption;
    if (interruptionDescriptor < 0) {
        // Signals that nobody would learn of had better end the program.
        return;
    }
    for (const int signal : signals) {
        struct sigaction before{};
        ::sigaction(signal, nullptr, &before);
        // A signal that whoever started the program wants ignored stays so.
        if (before.sa_handler != SIG_IGN) {
            ::sigaction(signal, &action, nullptr);
        }
        _earlier.emplace_back(signal, before);
    }
}

Interruption::~Interruption() {
    for (const auto& [signal, action] : _earlier) {
        ::sigaction(signal, &action, nullptr);
    }
}

int Interruption::descriptor() {
    return interruptionDescriptor;
}

} // namespace nimbra::cli
