#include "tests/house/Command.h"

#include <array>
#include <cerrno>
#include <cstddef>
#include <cstdio>
#include <sys/wait.h>
#include <system_error>

namespace nimbra::test {

namespace {

/// `word` as one word of the shell, whatever stands in it.
std::string quoted(const std::string& word) {
    std::string result = "'";
    for (const char character : word) {
        result += character == '\'' ? std::string("'\\''") : std::string(1, character);
    }
    return result + "'";
}

} // namespace

CommandResult run(const std::vector<std::string>& argv) {
    std::string line;
    for (const std::string& word : argv) {
        line += quoted(word) + ' ';
    }
    std::FILE* pipe = ::popen((line + "</dev/null 2>&1").c_str(), "r");
    if (pipe == nullptr) {
        throw std::system_error(errno, std::generic_category(), line);
    }
    CommandResult result;
    std::array<char, 4096> buffer{};
    std::size_t count = 0;
    while ((count = std::fread(buffer.data(), 1, buffer.size(), pipe)) > 0) {
        result.output.append(buffer.data(), count);
    }
    result.status = WEXITSTATUS(::pclose(pipe));
    return result;
}

} // namespace nimbra::test
