#pragma once

#include "tests/support/TemporaryDirectory.h"

#include <optional>
#include <string>
#include <sys/types.h>

namespace nimbra::test {

/// While it lives, the session bus of this process is one of its own, on which nobody else is.
class PrivateBus {
public:
    PrivateBus();
    PrivateBus(const PrivateBus&) = delete;
    PrivateBus& operator=(const PrivateBus&) = delete;
    ~PrivateBus();

    /// Ends the bus, so that its address leads nowhere.
    void end();

private:
    TemporaryDirectory _directory;
    std::optional<std::string> _earlierAddress;
    pid_t _daemon = -1;
};

} // namespace nimbra::test
