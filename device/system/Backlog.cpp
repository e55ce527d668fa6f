#include "device/system/Backlog.h"

#include <sys/eventfd.h>

namespace nimbra::device {

Backlog::Backlog() : _room(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {}

std::shared_ptr<void> Backlog::add() {
    ++_count;
    return {this, [self = shared_from_this()](void* /*backlog*/) { self->remove(); }};
}

void Backlog::takeBack() const {
    eventfd_t count = 0;
    static_cast<void>(::eventfd_read(_room.number(), &count));
}

void Backlog::remove() {
    --_count;
    // A full counter is a signal, too.
    static_cast<void>(::eventfd_write(_room.number(), 1));
}

} // namespace nimbra::device
