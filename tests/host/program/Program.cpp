#include "tests/host/program/Program.h"

#include <algorithm>
#include <array>
#include <fcntl.h>
#include <fstream>
#include <set>
#include <spawn.h>
#include <sstream>
#include <stdexcept>
#include <string_view>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {

namespace {

std::vector<char*> pointers(std::vector<std::string>& strings) {
    std::vector<char*> result;
    std::ranges::transform(strings, std::back_inserter(result),
                           [](std::string& string) { return string.data(); });
    result.push_back(nullptr);
    return result;
}

/// Starts `command` with its three standard files opened on the given ones.
pid_t spawn(std::vector<std::string> command, std::vector<std::string> environment,
            const std::array<int, 3>& files) {
    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    for (int file = 0; file < 3; ++file) {
        ::posix_spawn_file_actions_adddup2(&actions, files.at(static_cast<std::size_t>(file)),
                                           file);
    }
    pid_t process = 0;
    const int failure = ::posix_spawnp(&process, command.front().c_str(), &actions, nullptr,
                                       pointers(command).data(), pointers(environment).data());
    ::posix_spawn_file_actions_destroy(&actions);
    if (failure != 0) {
        throw std::runtime_error("cannot start " + command.front());
    }
    return process;
}

/// A file without a name, for what a program reads or writes.
class Scratch {
public:
    explicit Scratch(const std::string& content = {})
        : _file(::open("/tmp", O_TMPFILE | O_RDWR | O_CLOEXEC, 0600)) {
        if (_file < 0 || ::write(_file, content.data(), content.size()) !=
                             static_cast<ssize_t>(content.size())) {
            throw std::runtime_error("no scratch file");
        }
        ::lseek(_file, 0, SEEK_SET);
    }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    ~Scratch() { ::close(_file); }

    [[nodiscard]] int file() const { return _file; }

    [[nodiscard]] std::string content() const {
        std::string content(static_cast<std::size_t>(::lseek(_file, 0, SEEK_END)), '\0');
        static_cast<void>(::pread(_file, content.data(), content.size(), 0));
        return content;
    }

private:
    int _file;
};

} // namespace

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
    const Scratch in(input);
    const Scratch out;
    const Scratch messages;
    const pid_t process = spawn(command, environment(), {in.file(), out.file(), messages.file()});
    int status = 0;
    ::waitpid(process, &status, 0);
    return {exitStatusOf(status), out.content(), messages.content()};
}

pid_t Program::start(const std::vector<std::string>& arguments, int output) const {
    std::vector<std::string> command{NIMBRA_SETTINGSCTL};
    command.insert(command.end(), arguments.begin(), arguments.end());
    const Scratch nothing;
    return spawn(command, environment(), {nothing.file(), output, STDERR_FILENO});
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

int exitStatusOf(int waited) {
    return WIFEXITED(waited) ? WEXITSTATUS(waited) : -WTERMSIG(waited);
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
