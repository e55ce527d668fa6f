#pragma once

#include "tests/host/program/Program.h"

#include <array>
#include <csignal>
#include <gtest/gtest.h>
#include <pty.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace nimbra::test {

/// settingsctl at a terminal, typed into and read from as by a person.
class TypedProgram {
public:
    explicit TypedProgram(const Program& program, std::vector<std::string> arguments) {
        arguments.insert(arguments.begin(), NIMBRA_SETTINGSCTL);
        std::vector<std::string> environment = program.environment();
        const std::vector<char*> argumentPointers = pointers(arguments);
        const std::vector<char*> environmentPointers = pointers(environment);
        winsize size{.ws_row = 24, .ws_col = 80, .ws_xpixel = 0, .ws_ypixel = 0};
        _process = ::forkpty(&_terminal, nullptr, nullptr, &size);
        if (_process == 0) {
            ::execve(NIMBRA_SETTINGSCTL, argumentPointers.data(), environmentPointers.data());
            ::_exit(127);
        }
    }
    TypedProgram(const TypedProgram&) = delete;
    TypedProgram& operator=(const TypedProgram&) = delete;
    ~TypedProgram() { ::close(_terminal); }

    void type(const std::string& keys) const {
        ASSERT_EQ(::write(_terminal, keys.data(), keys.size()), static_cast<ssize_t>(keys.size()));
    }

    /// Reads until `text` was shown, and forgets what came before; false when the program ends
    /// without showing it.
    [[nodiscard]] bool shows(const std::string& text) {
        while (true) {
            if (const auto place = _shown.find(text); place != std::string::npos) {
                _shown.erase(0, place + text.size());
                return true;
            }
            std::array<char, 4096> more{};
            const ssize_t count = ::read(_terminal, more.data(), more.size());
            if (count <= 0) {
                ADD_FAILURE() << '"' << text << "\" was not shown, but: " << _shown;
                return false;
            }
            _shown.append(more.data(), static_cast<std::size_t>(count));
        }
    }

    /// Sends `signal` to the program.
    void send(int signal) const { ::kill(_process, signal); }

    /// The exit status of the program, which is about to end.
    [[nodiscard]] int end() const {
        std::array<char, 4096> ignored{};
        while (::read(_terminal, ignored.data(), ignored.size()) > 0) {
        }
        int status = 0;
        ::waitpid(_process, &status, 0);
        return exitStatusOf(status);
    }

private:
    static std::vector<char*> pointers(std::vector<std::string>& strings) {
        std::vector<char*> result;
        for (std::string& string : strings) {
            result.push_back(string.data());
        }
        result.push_back(nullptr);
        return result;
    }

    int _terminal = -1;
    pid_t _process = -1;
    std::string _shown;
};

} // namespace nimbra::test
