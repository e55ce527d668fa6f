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
    EXPECT_EQ(bashOffers(program, {"tap", "--y"}), "--yes\n");
    EXPECT_EQ(bashOffers(program, {"--locale", "d"}), "de-DE\n");
    EXPECT_EQ(bashOffers(program, {"set", "Nimbra Drive", "o"}), "on\noff\n");
    EXPECT_EQ(bashOffers(program, {"completion", "z"}), "zsh\n");
    EXPECT_EQ(bashOffers(program, {"--root", "set", "li"}), "list\n");
}

TEST(Completion, OffersTheRowsOfTheDeviceAskedForInBash) {
    const Program program;
    const std::string device = program.makePlainDevice("a device");

    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", ""}),
              "Nimbra\\ Drive\nUse\\ Cellular\\ Data\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", "\"Nim"}),
              "Nimbra Drive\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "set", "Nimbra\\ D"}),
              "Nimbra\\ Drive\n");
    EXPECT_EQ(bashOffers(program, {"--root", "'" + device + "'", "get", "X"}), "");
}

/// A device whose applications are called what is hard to type.
std::string oddDevice(const Program& program) {
    const auto description = program.write("odd.json", R"({
        "accounts": [{"identifier": "a", "usesStratafile": true,
                      "enabled": ["kAccountDataclassTidewater"]}],
        "apps": [{"identifier": "com.example.quotes", "name": "It's \"5\" $(x) `y` \\o/"},
                 {"identifier": "com.example.colon", "name": "Photos: a=b"},
                 {"identifier": "com.example.balloon", "name": "🎈 Party"},
                 {"identifier": "com.example.control", "name": "Red\u001b[31m"},
                 {"identifier": "one.notes", "name": "Notes"},
                 {"identifier": "two.notes", "name": "Notes"}],
        "consent": [{"service": "kPRVServiceTidewater", "bundle": "com.example.quotes"},
                    {"service": "kPRVServiceTidewater", "bundle": "com.example.colon"},
                    {"service": "kPRVServiceTidewater", "bundle": "com.example.balloon"},
                    {"service": "kPRVServiceTidewater", "bundle": "com.example.control"},
                    {"service": "kPRVServiceTidewater", "bundle": "one.notes"},
                    {"service": "kPRVServiceTidewater", "bundle": "two.notes"}]})");
    const std::string device = program.path("odd").string();
    EXPECT_EQ(program.run({"init", device, "--from", description.string()}).status, 0);
    return device;
}

TEST(Completion, OffersNamesAsTheyHaveToBeTypedInBash) {
    const Program program;
    const std::string device = oddDevice(program);
    const auto offers = [&](const std::string& typed) {
        return bashOffers(program, {"--root", device, "get", typed});
    };

    const std::string bare = R"(It\'s\ \"5\"\ \$\(x\)\ \`y\`\ \\o/)"
                             "\n";
    EXPECT_EQ(offers("It"), bare);
    EXPECT_EQ(offers(R"(It\'s\ \"5)"), bare);
    const std::string inDouble = R"(It's \"5\" \$(x) \`y\` \\o/)"
                                 "\n";
    EXPECT_EQ(offers("\"It"), inDouble);
    EXPECT_EQ(offers(R"("It's \"5\" \$)"), inDouble);
    EXPECT_EQ(offers("'It"), R"(It'\''s "5" $(x) `y` \o/)"
                             "\n");
    EXPECT_EQ(offers("Photos"), "Photos\\:\\ a\\=b\n");
    EXPECT_EQ(offers("Photos\\:\\ a"), "Photos\\:\\ a\\=b\n");
    EXPECT_EQ(offers("🎈"), "🎈\\ Party\n");
}

TEST(Completion, OffersIdentifiersWhereNoNameStartsAsTyped) {
    const Program program;
    const std::string device = oddDevice(program);
    const auto offers = [&](const std::string& typed) {
        return bashOffers(program, {"--root", device, "set", typed});
    };

    EXPECT_EQ(offers("com.example.b"), "com.example.balloon\n");
    EXPECT_EQ(offers("\"com.example.q"), "com.example.quotes\n");
    EXPECT_EQ(offers("com.example.z"), "");
}

TEST(Completion, OffersTheIdentifiersOfRowsThatCannotBeTypedOrToldApartByName) {
    const Program program;

    EXPECT_EQ(program.run({"--root", oddDevice(program), "complete-rows"}).output,
              "Nimbra Drive\n"
              "🎈 Party\n"
              "It's \"5\" $(x) `y` \\o/\n"
              "one.notes\n"
              "two.notes\n"
              "Photos: a=b\n"
              "com.example.control\n"
              "Use Cellular Data\n");
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
