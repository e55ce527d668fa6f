#include "host/cli/Terminal.h"

#include <algorithm>
#include <cstdlib>
#include <string_view>
#include <sys/ioctl.h>
#include <unistd.h>

namespace nimbra::cli {

Terminal Terminal::ofStandardOutput() {
    Terminal terminal;
    if (::isatty(STDOUT_FILENO) == 0) {
        return terminal;
    }
    // A value far from its row's name is hard to read across: a wide window is not filled.
    constexpr std::size_t narrowest = 24;
    constexpr std::size_t widest = 100;
    winsize size{};
    if (::ioctl(STDOUT_FILENO, TIOCGWINSZ, &size) == 0 && size.ws_col > 0) {
        terminal.width = std::clamp<std::size_t>(size.ws_col, narrowest, widest);
    }
    const char* noColor = std::getenv("NO_COLOR");
    const char* kind = std::getenv("TERM");
    terminal.isStyled = (noColor == nullptr || *noColor == '\0') && kind != nullptr &&
                        std::string_view(kind) != "dumb";
    return terminal;
}

} // namespace nimbra::cli
