#include "tests/host/program/DeviceProgram.h"
#include "tests/host/program/TypedProgram.h"

#include <filesystem>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::test {
namespace {

constexpr const char* row = "CLOUD_DRIVE_DIAGNOSE";
constexpr const char* busy = "Collecting Diagnostics…\n";

/// A device whose log level shows the diagnostics.
class Diagnose : public DeviceProgram {
protected:
    Diagnose() { init(R"({"writesArchive": true})"); }

    void init(const std::string& tool) {
        makeDevice(R"({
            "name": "Lab’s Phone",
            "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                          "enabled": ["kAccountDataclassTidewater"]}],
            "preferences": {"com.vantrel.marrow": {"log.level": 7}},
            "tool": )" +
                   tool + "}");
    }
    [[nodiscard]] std::filesystem::path archives() const {
        return program.path("device") /
               "var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/Stratafile";
    }
    /// The only archive.
    [[nodiscard]] std::filesystem::path archive() const {
        std::filesystem::path found;
        for (const auto& entry : std::filesystem::directory_iterator(archives())) {
            EXPECT_TRUE(found.empty()) << entry.path();
            found = entry.path();
        }
        return found;
    }
    /// Puts a mail program among those of the user that notes what it is given.
    [[nodiscard]] ProgramResult runWithMail(const std::string& commands,
                                            const std::string& input) const {
        const auto mail = program.write("bin/xdg-email", "#!/bin/sh\n" + commands + '\n');
        std::filesystem::permissions(mail, std::filesystem::perms::owner_all);
        std::vector<std::string> command{"/usr/bin/env",
                                         "PATH=" + program.path("bin").string() + ":/usr/bin:/bin",
                                         NIMBRA_SETTINGSCTL};
        for (const std::string& argument : onDevice({"tap", row})) {
            command.push_back(argument);
        }
        return program.runOther(command, input);
    }
};

TEST_F(Diagnose, SaysWhereTheArchiveIs) {
    const auto result = run({"tap", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, busy);
    EXPECT_EQ(result.output,
              archive().string() +
                  "\n  Copy it to which file or folder (nothing leaves it there): \n");
    EXPECT_TRUE(archive().filename().string().starts_with("stratafile-Lab's_Phone-"));
}

TEST_F(Diagnose, TheButtonHasANameAsWell) {
    const auto result = run({"tap", "Collect Diagnostics"});

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(result.output.starts_with(archive().string() + '\n'));
}

TEST_F(Diagnose, AsksNobodyWhoSaysYesBefore) {
    const auto result = run({"tap", "--yes", row});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, archive().string() + '\n');
}

TEST_F(Diagnose, CopiesTheArchive) {
    const auto copy = program.path("copy of it.tar.gz");

    const auto result = run({"tap", row}, copy.string() + '\n');

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, busy);
    EXPECT_TRUE(result.output.ends_with("Copied to " + copy.string() + '\n')) << result.output;
    EXPECT_EQ(readWhole(copy), readWhole(archive()));
}

TEST_F(Diagnose, CopiesTheArchiveIntoAFolder) {
    std::filesystem::create_directory(program.path("folder"));

    const auto result = run({"tap", row}, program.path("folder").string() + '\n');

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(readWhole(program.path("folder") / archive().filename()), readWhole(archive()));
}

TEST_F(Diagnose, CopiesTheArchiveToWhereTheUserIs) {
    const auto place = program.path("place");
    std::filesystem::create_directory(place);

    const auto result = program.runOther({"/bin/sh", "-c", "cd \"$0\" && exec \"$@\"",
                                          place.string(), NIMBRA_SETTINGSCTL, "--root",
                                          program.path("device").string(), "tap", row},
                                         "copy.tar.gz\n");

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_TRUE(result.output.ends_with("Copied to " + (place / "copy.tar.gz").string() + '\n'))
        << result.output;
    EXPECT_EQ(readWhole(place / "copy.tar.gz"), readWhole(archive()));
}

TEST_F(Diagnose, ACopyIsForItsOwner) {
    const auto copy = program.path("copy");

    ASSERT_EQ(run({"tap", row}, copy.string() + '\n').status, 0);

    EXPECT_EQ(std::filesystem::status(copy).permissions(),
              std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
}

TEST_F(Diagnose, BlanksAroundAnAnswerAreNoPartOfIt) {
    const auto result = run({"tap", row}, "  " + program.path("copy").string() + " \n");

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(std::filesystem::exists(program.path("copy")));
}

TEST_F(Diagnose, ANoLeavesTheArchiveWhereItIs) {
    for (const char* const answer : {"\n", "  \n", "n\n", "No\n", ""}) {
        const auto result = run({"tap", row}, answer);

        EXPECT_EQ(result.status, 0) << answer;
        EXPECT_EQ(result.output.find("Copied"), std::string::npos) << answer;
    }
}

TEST_F(Diagnose, ATildeIsTheHome) {
    const auto home = program.path("home");
    std::filesystem::create_directory(home);
    std::vector<std::string> command{"/usr/bin/env", "HOME=" + home.string(), NIMBRA_SETTINGSCTL};
    for (const std::string& argument : onDevice({"tap", row})) {
        command.push_back(argument);
    }

    const auto result = program.runOther(command, "~/copy\n");

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_TRUE(std::filesystem::exists(home / "copy"));
}

TEST_F(Diagnose, AProgramThatIgnoresItsChildrenIsNoHindrance) {
    std::vector<std::string> command{"/bin/sh", "-c", "trap '' CHLD; exec \"$@\"", "sh",
                                     NIMBRA_SETTINGSCTL};
    for (const std::string& argument : onDevice({"tap", "--yes", row})) {
        command.push_back(argument);
    }

    const auto result = program.runOther(command);

    EXPECT_EQ(result.status, 0) << result.messages;
}

TEST_F(Diagnose, TheRealToolFindsItsDeviceBehindALink) {
    init(R"("real")");
    std::filesystem::create_directory(program.path("device") / "system");
    std::filesystem::rename(program.path("device") / "usr", program.path("device") / "system/usr");
    std::filesystem::create_symlink("/system/usr", program.path("device") / "usr");

    const auto result = run({"tap", "--yes", row});

    ASSERT_EQ(result.status, 0) << result.messages;
    const auto listed = program.runOther({"tar", "-tzf", archive().string()});
    EXPECT_NE(listed.output.find("/accounts.json"), std::string::npos) << listed.output;
}

TEST_F(Diagnose, ReplacesNoFile) {
    const auto kept = program.write("kept", "kept");

    const auto result = run({"tap", row}, kept.string() + '\n');

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages,
              std::string(busy) + "settingsctl: " + kept.string() + ": is there already\n");
    EXPECT_EQ(readWhole(kept), "kept");
    EXPECT_FALSE(archive().empty());
}

TEST_F(Diagnose, ACopyThatCannotBeWrittenIsAFailure) {
    const auto result = run({"tap", row}, program.path("none/copy").string() + '\n');

    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.messages.find("none/copy: "), std::string::npos) << result.messages;
    EXPECT_FALSE(std::filesystem::exists(program.path("none")));
    EXPECT_FALSE(archive().empty());
}

TEST_F(Diagnose, HandsTheArchiveToTheMailProgram) {
    const auto result =
        runWithMail("printf '%s|' \"$@\" > " + program.path("mailed").string(), "m\n");

    EXPECT_EQ(result.status, 0);
    EXPECT_NE(result.output.find("which file or folder, or m for a mail (nothing"),
              std::string::npos)
        << result.output;
    EXPECT_EQ(readWhole(program.path("mailed")), "--attach|" + archive().string() + '|');
}

TEST_F(Diagnose, AMailProgramThatFailsIsAFailure) {
    const auto result = runWithMail("exit 3", "m\n");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, std::string(busy) +
                                   "settingsctl: " + program.path("bin/xdg-email").string() +
                                   " could not begin a mail\n");
}

TEST_F(Diagnose, TheTelltaleOfAFailureIsTheAlert) {
    for (const char* const tool :
         {"null", R"({"exit": 1, "writesArchive": true})", R"({"signal": 9})", "{}"}) {
        init(tool);

        const auto result = run({"tap", row});

        EXPECT_EQ(result.status, 1) << tool;
        EXPECT_EQ(result.output, "") << tool;
        EXPECT_EQ(result.messages, std::string(busy) +
                                       "settingsctl: No Diagnostics Collected: The diagnostics "
                                       "couldn’t be collected. Try again later.\n")
            << tool;
    }
}

TEST_F(Diagnose, TheDevicesOwnToolWritesARealArchive) {
    init(R"("real")");

    const auto result = run({"tap", "--yes", row});

    ASSERT_EQ(result.status, 0) << result.messages;
    const auto listed = program.runOther({"tar", "-tzf", archive().string()});
    EXPECT_EQ(listed.status, 0) << listed.messages;
    EXPECT_NE(listed.output.find("MANIFEST"), std::string::npos) << listed.output;
}

TEST_F(Diagnose, TheArchiveCanBeCopiedAtThePrompt) {
    const auto copy = program.path("copy");
    TypedProgram shell(program, onDevice({"shell"}));
    ASSERT_TRUE(shell.shows("> "));

    shell.type(std::string("tap ") + row + '\n');
    ASSERT_TRUE(shell.shows("leaves it there): "));
    shell.type(copy.string() + '\n');
    ASSERT_TRUE(shell.shows("Copied to "));
    shell.type("quit\n");

    EXPECT_EQ(shell.end(), 0);
    EXPECT_EQ(readWhole(copy), readWhole(archive()));
}

} // namespace
} // namespace nimbra::test
