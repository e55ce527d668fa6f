#include "tests/host/program/Program.h"
#include "tests/host/program/TypedProgram.h"

#include <gtest/gtest.h>
#include <string>
#include <unistd.h>
#include <vector>

namespace nimbra::test {
namespace {

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
    TypedProgram shell(_program, arguments());

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
    TypedProgram shell(_program, arguments());

    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("tap Later\r");
    ASSERT_TRUE(shell.shows("+ Arrived"));
    ASSERT_TRUE(shell.shows("nimbra> "));
    shell.type("quit\r");
    EXPECT_EQ(shell.end(), 0);
}

TEST_F(ShellAtATerminal, CompletesCommandsAndRows) {
    TypedProgram shell(_program, arguments());

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
    TypedProgram shell(_program, arguments());

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
        TypedProgram first(_program, arguments());
        ASSERT_TRUE(first.shows("nimbra> "));
        first.type("get Storage\r");
        ASSERT_TRUE(first.shows("3 apps"));
        ASSERT_TRUE(first.shows("nimbra> "));
        first.type("\x04");
        ASSERT_EQ(first.end(), 0);
    }
    EXPECT_TRUE(std::filesystem::exists(_program.path("state/nimbra/history")));

    TypedProgram second(_program, arguments());
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
