#include "tools/mrctl/Ending.h"

#include "device/DeviceError.h"
#include "tools/mrctl/Arguments.h"

#include <cstdlib>
#include <exception>
#include <iostream>
#include <new>
#include <ostream>

namespace nimbra::mrctl {

namespace {

constexpr auto tooLittleMemory = "mrctl: there is not enough memory\n";

/// In the place of an abort, where the memory is missing to something that may not fail: a large
/// document needs some to be destroyed.
[[noreturn]] void terminate() {
    try {
        if (const auto exception = std::current_exception()) {
            std::rethrow_exception(exception);
        }
    } catch (const std::bad_alloc&) {
        std::cerr << tooLittleMemory;
        std::_Exit(exitFailed);
    } catch (...) {
        std::abort();
    }
    std::abort();
}

/// While it lives, `terminate` is what ends the process.
class Terminating {
public:
    Terminating() : _earlier(std::set_terminate(terminate)) {}
    Terminating(const Terminating&) = delete;
    Terminating& operator=(const Terminating&) = delete;
    ~Terminating() { std::set_terminate(_earlier); }

private:
    std::terminate_handler _earlier;
};

} // namespace

int exitStatusOf(const std::function<int()>& program, std::ostream& messages) {
    const Terminating terminating;
    try {
        return program();
    } catch (const std::bad_alloc&) {
        // Nothing here asks for more.
        messages << tooLittleMemory;
    } catch (const std::exception& exception) {
        messages << "mrctl: " + device::oneLine(exception.what()) + '\n';
    }
    return exitFailed;
}

} // namespace nimbra::mrctl
