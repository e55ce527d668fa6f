#include "tests/tools/mrctl/Diagnosis.h"

#include <algorithm>
#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

using Strings = std::vector<std::string>;

ProgramResult run(std::vector<std::string> arguments) {
    arguments.insert(arguments.begin(), NIMBRA_MRCTL);
    return runProgram(arguments, {});
}

TEST(MrctlUsageTest, BadArgumentsAreOneLineAndStatusTwo) {
    const std::vector<std::vector<std::string>> lines{{},
                                                      {"diagnose"},
                                                      {"diagnose", ""},
                                                      {"diagnose", "a", "b"},
                                                      {"unknown"},
                                                      {"status", "extra"},
                                                      {"status", "--no"},
                                                      {"status", "--no-logarchive"},
                                                      {"--root"},
                                                      {"--wrong\nline"},
                                                      {"diagnose", "--json", "a"},
                                                      {"--root", "", "status"}};
    for (const auto& line : lines) {
        const ProgramResult result = run(line);
        EXPECT_EQ(result.status, 2) << result.messages;
        EXPECT_EQ(result.output, "");
        EXPECT_TRUE(result.messages.starts_with("mrctl: ")) << result.messages;
        EXPECT_EQ(std::ranges::count(result.messages, '\n'), 1) << result.messages;
    }
}

TEST(MrctlUsageTest, AWordThatIsNoCommandIsNamed) {
    EXPECT_EQ(run({"frob"}).messages, "mrctl: frob: no such command (see mrctl --help)\n");
    EXPECT_EQ(run({"--root", "/", "frob", "x"}).messages,
              "mrctl: frob: no such command (see mrctl --help)\n");
    EXPECT_EQ(run({"--frob"}).messages, "mrctl: --frob: no such option (see mrctl --help)\n");
    EXPECT_EQ(run({}).messages, "mrctl: A subcommand is required (see mrctl --help)\n");
    EXPECT_TRUE(run({"diagnose"}).messages.contains("PATH")) << run({"diagnose"}).messages;
}

TEST(MrctlUsageTest, AnOptionWithNothingBehindItsSignIsEmpty) {
    for (const auto& line :
         {Strings{"--root=", "status"}, {"status", "--root="}, {"--root=", "--version"}}) {
        const ProgramResult result = run(line);
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.output, "");
        EXPECT_EQ(result.messages, "mrctl: --root: is empty (see mrctl --help)\n");
    }
}

TEST(MrctlUsageTest, BehindTwoHyphensIsNoOption) {
    const Diagnosis diagnosis;
    diagnosis.make({});

    const ProgramResult result = runProgram(
        {"sh", "-c", "cd \"$1\" && exec \"$0\" --root \"$2\" diagnose -- --root=", NIMBRA_MRCTL,
         diagnosis.place().string(), diagnosis.root().string()},
        {"PATH=/usr/bin:/bin"});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(diagnosis.namesInPlace(), Strings{"--root="});
}

TEST(MrctlUsageTest, HelpAndVersionGoToStandardOutput) {
    EXPECT_EQ(run({"--version"}).output, "mrctl " NIMBRA_VERSION "\n");
    for (const auto& line : {std::vector<std::string>{"--help"}, {"diagnose", "--help"}}) {
        const ProgramResult result = run(line);
        EXPECT_EQ(result.status, 0);
        EXPECT_NE(result.output.find("diagnose"), std::string::npos);
        EXPECT_EQ(result.messages, "");
    }
}

TEST(MrctlUsageTest, ADirectoryThatIsNoDeviceHasNoStatusAndNoArchive) {
    const TemporaryDirectory directory;
    const std::string archive = directory.path().string() + "/archive.tar.gz";
    for (const std::string& root :
         Strings{directory.path().string(), directory.path().string() + "/no"}) {
        for (const Strings& command : {Strings{"status"}, Strings{"diagnose", archive}}) {
            Strings arguments{"--root", root};
            arguments.insert(arguments.end(), command.begin(), command.end());
            const ProgramResult result = run(arguments);
            EXPECT_EQ(result.status, 1);
            EXPECT_EQ(result.output, "");
            EXPECT_TRUE(result.messages.starts_with("mrctl: " + root + ": ")) << result.messages;
            EXPECT_EQ(std::ranges::count(result.messages, '\n'), 1);
        }
    }
    EXPECT_FALSE(std::filesystem::exists(archive));
}

} // namespace
} // namespace nimbra::test
