#pragma once

#include <csignal>
#include <sys/resource.h>

namespace nimbra::test {

/// While it lives, no file of this process can grow: the disk is full.
class FullDisk {
public:
    FullDisk() : _handler(std::signal(SIGXFSZ, SIG_IGN)) {
        ::getrlimit(RLIMIT_FSIZE, &_earlier);
        rlimit none = _earlier;
        none.rlim_cur = 0;
        ::setrlimit(RLIMIT_FSIZE, &none);
    }
    FullDisk(const FullDisk&) = delete;
    FullDisk& operator=(const FullDisk&) = delete;
    ~FullDisk() {
        ::setrlimit(RLIMIT_FSIZE, &_earlier);
        static_cast<void>(std::signal(SIGXFSZ, _handler));
    }

private:
    rlimit _earlier{};
    void (*_handler)(int);
};

} // namespace nimbra::test
