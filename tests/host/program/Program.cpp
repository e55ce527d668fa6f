#include "tests/host/program/Program.h"

#include <algorithm>
#include <array>
#include <fcntl.h>
#include <fstream>
#include <set>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <unistd.h>

namespace nimbra::test {

Program::Program() {
    std::filesystem::create_directories(path("tmp"));
}

ProgramResult Program::run(const std::vector<std::string>& arguments,
                           const std::string& input) const {
    std::vector<std::string> command{NIMBRA_SETTINGSCTL};
    command.insert(command.end(), arguments.begin(), arguments.end());
    return runOther(command, input);
}

ProgramResult Program::runOther(const std::vector<std::string>& command,
                                const std::string& input) const {
    return runProgram(command, environment(), input);
}

pid_t Program::start(const std::vector<std::string>& arguments, int output) const {
    std::vector<std::string> command{NIMBRA_SETTINGSCTL};
    command.insert(command.end(), arguments.begin(), arguments.end());
    const int nothing = ::open("/dev/null", O_RDONLY | O_CLOEXEC);
    const pid_t process = startProgram(command, environment(), {nothing, output, STDERR_FILENO});
    ::close(nothing);
    return process;
}

std::vector<std::string> Program::environment() const {
    const std::array<std::string, 6> own{"HOME=" + path("home").string(),
                                         "TMPDIR=" + path("tmp").string(),
                                         "XDG_STATE_HOME=" + path("state").string(),
                                         "LC_ALL=C.UTF-8",
                                         "NO_COLOR=1",
                                         "TERM=xterm"};
    std::vector<std::string> environment(own.begin(), own.end());
    for (char** entry = environ; *entry != nullptr; ++entry) {
        const std::string_view text = *entry;
        const std::string_view name = text.substr(0, text.find('=') + 1);
        if (std::ranges::none_of(own, [&](const auto& other) { return other.starts_with(name); })) {
            environment.emplace_back(text);
        }
    }
    return environment;
}

std::filesystem::path Program::path(const std::string& name) const {
    return _directory.path() / name;
}

std::filesystem::path Program::write(const std::string& name, const std::string& content) const {
    const auto file = path(name);
    std::filesystem::create_directories(file.parent_path());
    std::ofstream(file, std::ios::binary) << content;
    return file;
}

std::string Program::makePlainDevice(const std::string& name) const {
    const auto description = write("plain.json", R"({"accounts": [
        {"identifier": "primary", "primary": true, "usesStratafile": true,
         "enabled": ["kAccountDataclassTidewater"]}]})");
    const std::string device = path(name).string();
    if (run({"init", device, "--from", description.string()}).status != 0) {
        throw std::runtime_error("the device in " + device + " cannot be made");
    }
    return device;
}

bool Program::leftNothingBehind() const {
    return std::filesystem::is_empty(path("tmp"));
}

std::filesystem::path Program::defaultDevice() const {
    return path("state") / "nimbra" / "device";
}

std::string contentsOf(const std::filesystem::path& directory) {
    std::set<std::filesystem::path> paths;
    for (const auto& entry : std::filesystem::recursive_directory_iterator(directory)) {
        paths.insert(entry.path());
    }
    std::string contents;
    for (const auto& path : paths) {
        contents += path.string() + '\n';
        if (std::filesystem::is_regular_file(path)) {
            contents += readWhole(path) + '\n';
        }
    }
    return contents;
}

std::string readWhole(const std::filesystem::path& path) {
    std::ostringstream content;
    content << std::ifstream(path, std::ios::binary).rdbuf();
    return content.str();
}

} // namespace nimbra::test
