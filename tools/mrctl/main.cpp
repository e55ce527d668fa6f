#include "device/DeviceError.h"
#include "tools/mrctl/Arguments.h"
#include "tools/mrctl/Commands.h"
#include "tools/mrctl/Ending.h"

#include <csignal>
#include <fcntl.h>
#include <iostream>
#include <unistd.h>

namespace {

/// Gives the three standard files that the caller has closed to nobody: a file that is opened later
/// would get their numbers, and messages would go into it. Nothing can be written to them, so that
/// what was to be printed is not lost unnoticed.
void fillStandardFiles() {
    int number = 0;
    while (number >= 0 && number <= STDERR_FILENO) {
        number = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    }
    if (number > STDERR_FILENO) {
        ::close(number);
    }
}

} // namespace

int main(int count, char** words) {
    using namespace nimbra;
    fillStandardFiles();
    // A file that may not grow is an error of the writing, not the end of the program.
    static_cast<void>(std::signal(SIGXFSZ, SIG_IGN));
    return mrctl::exitStatusOf(
        [&] {
            const auto arguments = mrctl::Arguments::parse(count, words);
            if (!arguments) {
                return arguments.error();
            }
            if (const auto done = mrctl::run(*arguments, std::cout); !done) {
                std::cerr << "mrctl: " + device::oneLine(done.error().description) + '\n';
                return mrctl::exitFailed;
            }
            return mrctl::exitDone;
        },
        std::cerr);
}
