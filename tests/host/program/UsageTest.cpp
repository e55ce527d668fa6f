#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

TEST(Usage, AMistakeOnTheCommandLineIsOneLineAndMakesNothing) {
    const std::vector<std::vector<std::string>> mistakes{
        {},
        {"dance"},
        {"list", "more"},
        {"get"},
        {"set", "Nimbra Drive"},
        {"init"},
        {"play"},
        {"completion", "fish"},
        {"--locale", "x!", "list"},
        {"--locale", "", "list"},
        {"--unknown", "list"},
        {"play", "--root", "somewhere", "scenario.json"},
        {"init", "--account", "a", "somewhere"},
        {"--root", "", "list"},
        {"--bundle", "", "list"},
        {"init", ""},
        {"init", "somewhere", "--from", ""},
        {"play", ""},
        {"play", "scenario.json", "--keep", ""},
    };
    for (const auto& arguments : mistakes) {
        const Program program;

        const auto result = program.run(arguments);

        SCOPED_TRACE(arguments.empty() ? "" : arguments.front());
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.output, "");
        EXPECT_TRUE(result.messages.starts_with("settingsctl: ")) << result.messages;
        EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1) << result.messages;
        EXPECT_FALSE(std::filesystem::exists(program.path("state")));
    }
}

TEST(Usage, AnEmptyPathIsNamed) {
    const Program program;

    EXPECT_EQ(program.run({"--root", "", "list"}).messages,
              "settingsctl: --root: is empty (see settingsctl --help)\n");
    EXPECT_EQ(program.run({"init", ""}).messages,
              "settingsctl: DIR: is empty (see settingsctl --help)\n");
    EXPECT_EQ(program.run({"--bundle", "", "list"}).messages,
              "settingsctl: --bundle: is empty (see settingsctl --help)\n");
}

TEST(Usage, AnOptionWithoutAValueBehindItsSignTakesNotTheNextWord) {
    const Program program;

    for (const std::string option : {"--root", "--bundle", "--locale", "--account"}) {
        const auto result = program.run({option + '=', "tap", "list"});
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.messages,
                  "settingsctl: " + option + ": is empty (see settingsctl --help)\n");
        EXPECT_FALSE(std::filesystem::exists("tap"));
    }
    EXPECT_EQ(program.run({"init", "--from=", "device"}).messages,
              "settingsctl: --from: is empty (see settingsctl --help)\n");
    EXPECT_EQ(program.run({"--a\nb=", "list"}).messages,
              "settingsctl: --a b: is empty (see settingsctl --help)\n");
    // Behind "--" everything is a name.
    EXPECT_EQ(program.run({"--root", program.makePlainDevice("device"), "get", "--", "--root="})
                  .messages.find("is empty"),
              std::string::npos);
}

TEST(Usage, HelpNamesEveryCommand) {
    const Program program;

    const auto result = program.run({"--help"});

    EXPECT_EQ(result.status, 0);
    for (const std::string command :
         {"list", "get", "set", "tap", "init", "play", "shell", "completion"}) {
        EXPECT_NE(result.output.find("\n  " + command + ' '), std::string::npos) << command;
        EXPECT_EQ(program.run({command, "--help"}).status, 0) << command;
    }
}

TEST(Usage, TheVersionIsTheProjects) {
    const Program program;

    EXPECT_EQ(program.run({"--version"}).output, "settingsctl " NIMBRA_VERSION "\n");
}

} // namespace
} // namespace nimbra::test
