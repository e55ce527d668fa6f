#include "host/cli/Waiting.h"

#include "host/cli/Interruption.h"
#include "host/core/PaneSession.h"

#include <array>
#include <poll.h>
#include <unistd.h>

namespace nimbra::cli {

bool waitForWork(host::PaneSession& session) {
    std::array descriptors{
        pollfd{.fd = session.loop().wakeUpDescriptor(), .events = POLLIN, .revents = 0},
        pollfd{.fd = Interruption::descriptor(), .events = POLLIN, .revents = 0},
        // Of an output, only that it has gone.
        pollfd{.fd = STDOUT_FILENO, .events = 0, .revents = 0}};
    const auto& [work, interruption, output] = descriptors;
    while (true) {
        if (::poll(descriptors.data(), descriptors.size(), -1) < 0) {
            continue;
        }
        if (interruption.revents != 0 || output.revents != 0) {
            return false;
        }
        if (work.revents != 0) {
            return true;
        }
    }
}

} // namespace nimbra::cli
