#include "tests/host/program/Program.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

/// What bash offers for the last of `words`, one a line.
std::string bashOffers(const Program& program, const std::vector<std::string>& words) {
    const auto script = program.write(
        "complete.bash", "source \"$1\"; shift\n"
                         "COMP_WORDS=(\"$@\"); COMP_CWORD=$(($# - 1))\n"
                         "_settingsctl\n"
                         "((${#COMPREPLY[@]} == 0)) || printf '%s\\n' \"${COMPREPLY[@]}\"\n");
    const auto source =
        program.write("settingsctl.bash", program.run({"completion", "bash"}).output);
    std::vector<std::string> command{"bash", script.string(), source.string(), NIMBRA_SETTINGSCTL};
    command.insert(command.end(), words.begin(), words.end());
    const auto result = program.runOther(command);
    EXPECT_EQ(result.messages, "");
    return result.output;
}

TEST(Completion, PrintsTheScriptsThatAreInstalled) {
    const Program program;

    EXPECT_EQ(program.run({"completion", "bash"}).output,
              readWhole(NIMBRA_COMPLETION "/settingsctl.bash"));
    EXPECT_EQ(program.run({"completion", "zsh"}).output,
              readWhole(NIMBRA_COMPLETION "/_settingsctl"));
}

TEST(Completion, OffersCommandsAndOptionsInBash) {
    const Program program;

    EXPECT_EQ(bashOffers(program, {"s"}), "set\nshell\n");
    EXPECT_EQ(bashOffers(program, {"--lo"}), "--locale\n");
    EXPECT_EQ(bashOffers(program, {"list", "--j"}), "--json\n");
    EXPECT_EQ(bashOffers(program, {"--locale", "d"}), "de-DE\n");
    EXPECT_EQ(bashOffers(program, {"set", "Nimbra Drive", "o"}), "on\noff\n");
    EXPECT_EQ(bashOffers(program, {"completion", "z"}), "zsh\n");
    EXPECT_EQ(bashOffers(program, {"--root", "set", "li"}), "list\n");
}

TEST(Completion, OffersTheRowsOfTheDeviceAskedForInBash) {
    const Program program;
    const std::string device = program.path("a device").string();
    ASSERT_EQ(program.run({"init", device}).status, 0);

    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", ""}),
              "Nimbra\\ Drive\nUse\\ Cellular\\ Data\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", "\"Nim"}),
              "Nimbra Drive\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "set", "Nimbra\\ D"}),
              "Nimbra\\ Drive\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", "X"}), "");
}

TEST(Completion, RunsNothingThatStandsInTheLine) {
    const Program program;
    const auto trap = program.path("trap");

    EXPECT_EQ(bashOffers(program, {"--root", "$(touch " + trap.string() + ")", "get", ""}), "");
    EXPECT_FALSE(std::filesystem::exists(trap));
}

TEST(Completion, MakesNoDeviceAndSaysNothing) {
    const Program program;

    EXPECT_EQ(bashOffers(program, {"get", ""}), "");
    EXPECT_FALSE(std::filesystem::exists(program.path("state")));
}

} // namespace
} // namespace nimbra::test
