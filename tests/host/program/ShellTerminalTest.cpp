#include "tests/host/program/Program.h"

#include <array>
#include <gtest/gtest.h>
#include <pty.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace nimbra::test {
namespace {

/// The shell at a terminal, typed into and read from as by a person.
class TypedShell {
public:
    explicit TypedShell(const Program& program, std::vector<std::string> arguments) {
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
    TypedShell(const TypedShell&) = delete;
    TypedShell& operator=(const TypedShell&) = delete;
    ~TypedShell() { ::close(_terminal); }

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

class ShellAtATerminal : public testing::Test {
protected:
    ShellAtATerminal() {
        EXPECT_EQ(_program.run({"init", _program.path("device").string()}).status, 0);
    }

    [[nodiscard]] std::vector<std::string> arguments() const {
        return {"--root", _program.path("device").string(), "--bundle", NIMBRA_TEST_BUNDLE,
                "shell"};
    }

    Program _program;
};

TEST_F(ShellAtATerminal, PromptsForCommandsAndEndsAtTheEndOfInput) {
    TypedShell shell(_program, arguments());

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("get Notes\r");
    ASSERT_TRUE(shell.shows("\noff\r\n"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("dance\r");
    ASSERT_TRUE(shell.shows("settingsctl: no command \"dance\""));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("\x04");
    EXPECT_EQ(shell.end(), 0);
}

TEST_F(ShellAtATerminal, ShowsChangesWhileItWaitsForACommand) {
    TypedShell shell(_program, arguments());

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap Later\r");
    ASSERT_TRUE(shell.shows("+ Arrived"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("quit\r");
    EXPECT_EQ(shell.end(), 0);
}

TEST_F(ShellAtATerminal, CompletesCommandsAndRows) {
    TypedShell shell(_program, arguments());

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("ge\tSto\t\r");
    ASSERT_TRUE(shell.shows("3 apps"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap Noth\t\r");
    ASSERT_TRUE(shell.shows("\"Nothing Behind\" does nothing in this version"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("get tw\t\t");
    ASSERT_TRUE(shell.shows("twin.one\r\n"));
    ASSERT_TRUE(shell.shows("twin.two\r\n"));
    shell.type("o\t\r");
    ASSERT_TRUE(shell.shows("\"Twin\" is a link and has no value"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("quit\r");
    EXPECT_EQ(shell.end(), 0);
}

TEST_F(ShellAtATerminal, GivesUpALineOnInterruptAndGoesOn) {
    TypedShell shell(_program, arguments());

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap Leave");
    ASSERT_TRUE(shell.shows("tap Leave"));
    shell.type("\x03");
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("get Notes\r");
    ASSERT_TRUE(shell.shows("\noff\r\n"));
    shell.type("quit\r");
    EXPECT_EQ(shell.end(), 0);
}

TEST_F(ShellAtATerminal, RemembersLinesFromOneUseToTheNext) {
    {
        TypedShell first(_program, arguments());
        ASSERT_TRUE(first.shows("nimbra> "));
        first.type("get Storage\r");
        ASSERT_TRUE(first.shows("3 apps"));
        ASSERT_TRUE(first.shows("nimbra> "));
        first.type("\x04");
        ASSERT_EQ(first.end(), 0);
    }
    EXPECT_TRUE(std::filesystem::exists(_program.path("state/nimbra/history")));

    TypedShell second(_program, arguments());
    ASSERT_TRUE(second.shows("nimbra> "));
    second.type("\x10\r");
    ASSERT_TRUE(second.shows("3 apps"));
    // Before the prompt the terminal would take the key for itself.
    ASSERT_TRUE(second.shows("nimbra> "));
    second.type("\x04");
    EXPECT_EQ(second.end(), 0);
}

} // namespace
} // namespace nimbra::test
