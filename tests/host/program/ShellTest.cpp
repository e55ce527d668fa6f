#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::test {
namespace {

ProgramResult runShell(const Program& program, const std::string& input) {
    const std::string device = program.path("device").string();
    static_cast<void>(program.run({"init", device}));
    return program.run({"--root", device, "--bundle", NIMBRA_TEST_BUNDLE, "shell"}, input);
}

TEST(Shell, DoesOneCommandALineWithoutAPrompt) {
    const Program program;

    const auto result = runShell(program, "get Notes\n\n  set com.example.notes on\nget 'Notes'\n");

    EXPECT_EQ(result.output,
              "off\n"
              "~ Notes                                                                       on\n"
              "+ Details                                                                      ›\n"
              "on\n");
    EXPECT_EQ(result.messages, "");
    EXPECT_EQ(result.status, 0);
}

TEST(Shell, TakesNamesOfSeveralWordsWithAndWithoutQuotationMarks) {
    const Program program;

    const auto result = runShell(program, "tap Reload Parent\ntap \"Reload Parent\"\n"
                                          "tap Reload\\ Parent\ntap Reload\n");

    EXPECT_EQ(result.output, "");
    EXPECT_TRUE(result.messages.starts_with("settingsctl: no row \"Reload\" ")) << result.messages;
    EXPECT_EQ(result.status, 1);
}

TEST(Shell, GoesOnAfterACommandThatFailsAndEndsWithItsStatus) {
    const Program program;

    const auto refused = runShell(program, "get Foo\nget Notes\n");
    EXPECT_EQ(refused.output, "off\n");
    EXPECT_EQ(refused.status, 1);

    const auto wrong = runShell(program, "get Foo\ndance\nset Notes\nget \"Notes\nget Notes\n");
    EXPECT_EQ(wrong.output, "off\n");
    EXPECT_EQ(wrong.status, 2);
    EXPECT_NE(wrong.messages.find("settingsctl: no command \"dance\"; \"help\" lists them\n"
                                  "settingsctl: usage: set ROW on|off\n"
                                  "settingsctl: a quotation mark is not closed\n"),
              std::string::npos)
        << wrong.messages;
}

TEST(Shell, ShowsWhatChangesLater) {
    const Program program;

    const auto result = runShell(program, "tap Later\nget Arrived\nquit\nget Notes\n");

    EXPECT_EQ(result.output,
              "+ Arrived                                                                      ›\n");
    EXPECT_EQ(result.messages, "settingsctl: \"Arrived\" is a link and has no value\n");
}

TEST(Shell, EndsWhenThePageCloses) {
    const Program program;

    const auto result = runShell(program, "tap Leave\nget Notes\n");

    EXPECT_EQ(result.output, "The page has closed.\n");
    EXPECT_EQ(result.status, 0);
}

TEST(Shell, KeepsTheRealPageOpenAndRefreshesIt) {
    const Program program;

    const auto result = program.run({"shell"}, "list\nrefresh\nactive\nlist --json\nhelp\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(result.output.starts_with("Nimbra Drive\n\n  Nimbra Drive  ")) << result.output;
    EXPECT_NE(result.output.find("\nRefreshed.\n[\n"), std::string::npos) << result.output;
    EXPECT_NE(result.output.find("\n  set ROW on|off  turn a switch on or off\n"),
              std::string::npos)
        << result.output;
}

} // namespace
} // namespace nimbra::test
