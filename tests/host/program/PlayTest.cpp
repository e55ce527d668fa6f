#include "tests/device/TestFiles.h"
#include "tests/host/program/Program.h"

#include <array>
#include <csignal>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <vector>

namespace nimbra::test {
namespace {

/// The lines of a trace that stand behind the event of step `index`, without that one.
std::string eventsOfStep(const std::string& trace, std::size_t index) {
    const std::string head =
        R"({"event":"step","queue":"main","index":)" + std::to_string(index) + ',';
    const auto start = trace.find('\n', trace.find(head)) + 1;
    return trace.substr(start, trace.find(R"({"event":"step")", start) - start);
}

ProgramResult playRows(const Program& program, const std::string& steps) {
    return program.run({"--bundle", NIMBRA_TEST_BUNDLE, "play", "-"},
                       R"({"steps": [{"do": "open"})" + steps + "]}");
}

TEST(Play, TakesTheScenarioFromStandardInput) {
    const Program program;

    const auto result = program.run({"play", "-"}, R"({"steps": [{"do": "open"}]})");

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(result.output.starts_with(R"({"event":"step","queue":"main","index":0,"do":"open"})"
                                          "\n"));
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(Play, CallsBrokenStandardInputByItsName) {
    const Program program;

    const auto result = program.run({"play", "-"}, R"({"steps": 1})");

    EXPECT_EQ(result.status, 2);
    EXPECT_TRUE(result.messages.starts_with("settingsctl: standard input: /steps: "));
}

TEST(Play, RefusesAScenarioThatIsTooLargeInOneLine) {
    const Program program;
    const auto large = program.write("large.json", "");
    std::filesystem::resize_file(large, 64'000'001);
    const auto expectRefused = [](const ProgramResult& result, const std::string& name) {
        EXPECT_EQ(result.status, 2);
        EXPECT_EQ(result.output, "");
        EXPECT_EQ(result.messages, "settingsctl: " + name + ": is larger than 64000000 bytes\n");
    };

    expectRefused(program.run({"play", large.string()}), large.string());
    expectRefused(program.run({"play", "/dev/zero"}), "/dev/zero");
    expectRefused(
        program.runOther({"sh", "-c", "exec \"$1\" play - < /dev/zero", "sh", NIMBRA_SETTINGSCTL}),
        "standard input");
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(Play, ReadsAScenarioOfTheGreatestSize) {
    const Program program;
    const auto large = program.write("large.json", "");
    std::filesystem::resize_file(large, 64'000'000);

    const auto result = program.run({"play", large.string()});

    EXPECT_EQ(result.status, 2);
    EXPECT_TRUE(result.messages.starts_with("settingsctl: " + large.string() + ": line 1"))
        << result.messages;
}

TEST(Play, SaysThatStandardInputIsClosed) {
    const Program program;

    const auto result =
        program.runOther({"sh", "-c", "exec \"$1\" play - <&-", "sh", NIMBRA_SETTINGSCTL});

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.messages,
              "settingsctl: standard input: cannot be read: Bad file descriptor\n");
}

TEST(Play, KeepsTheDeviceWhereItIsTold) {
    const Program program;
    const std::string device = program.path("kept").string();

    const auto result = program.run({"play", "--keep", device, "-"}, R"({"steps": []})");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(program.run({"--root", device, "get", "Nimbra Drive"}).output, "off\n");
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(Play, RefusesToKeepTheDeviceInADirectoryThatIsInUse) {
    const Program program;
    program.write("used/file", "mine");
    const std::string before = contentsOf(program.path("used"));

    const auto result = program.run({"play", "--keep", program.path("used").string(), "-"},
                                    R"({"steps": [{"do": "open"}]})");

    EXPECT_EQ(result.status, 2);
    EXPECT_EQ(result.output, "");
    EXPECT_NE(result.messages.find("used"), std::string::npos);
    EXPECT_EQ(result.messages.find('\n'), result.messages.size() - 1);
    EXPECT_EQ(contentsOf(program.path("used")), before);
}

TEST(Play, AFailingStepEndsWithOneAndLeavesTheTraceUpToThere) {
    const Program program;

    const auto result =
        program.run({"play", "-"},
                    R"({"steps": [{"do": "open"}, {"do": "get", "row": "Foo"}, {"do": "list"}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages,
              "settingsctl: step 1 (get): no row \"Foo\" (rows: \"Nimbra Drive\")\n");
    EXPECT_TRUE(result.output.ends_with(R"({"event":"step","queue":"main","index":1,"do":"get"})"
                                        "\n"));
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(Play, ALockedSwitchCannotBeSet) {
    const Program program;

    const auto result = program.run({"play", "-"}, R"({
        "device": {"restrictions": {"appCellularDataModificationAllowed": false},
                   "accounts": [{"identifier": "a", "enabled": ["kAccountDataclassTidewater"]}]},
        "steps": [{"do": "open"}, {"do": "set", "row": "Use Cellular Data", "value": true}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: step 1 (set): \"Use Cellular Data\" is locked\n");
}

TEST(Play, AFailedSaveCallsTheDatabaseByItsPathOnTheDevice) {
    const Program program;

    const auto kept = program.path("kept");

    const auto result = program.run({"play", "--keep", kept.string(), "-"}, R"({"steps": [
        {"do": "open"}, {"do": "change", "device": {"accounts": []}},
        {"do": "set", "row": "Nimbra Drive", "value": true}, {"do": "get", "row": "Foo"}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_NE(result.output.find(
                  R"("description":"/var/lib/nimbra/accounts.db: holds no such account any more")"),
              std::string::npos)
        << result.output;
    EXPECT_EQ(result.messages,
              "settingsctl: step 3 (get): no row \"Foo\" (rows: \"Nimbra Drive\")\n")
        << "one line, whatever the device has to say";
    EXPECT_TRUE(contentOf(kept / "var/log/nimbra/settings.log")
                    .ends_with("error: Can't save account primary: "
                               "/var/lib/nimbra/accounts.db: holds no such account any more\n"));
}

TEST(Play, AStepThatNeedsAPaneFailsWithoutOne) {
    for (const std::string step :
         {R"({"do": "appear"})", R"({"do": "disappear"})", R"({"do": "list"})",
          R"({"do": "get", "row": "a"})", R"({"do": "set", "row": "a", "value": true})",
          R"({"do": "tap", "row": "a"})", R"({"do": "pullToRefresh"})", R"({"do": "close"})"}) {
        const Program program;

        const auto result = program.run({"play", "-"}, R"({"steps": [)" + step + "]}");

        EXPECT_EQ(result.status, 1) << step;
        EXPECT_TRUE(result.messages.ends_with("no page is open\n")) << result.messages;
        EXPECT_TRUE(program.leftNothingBehind());
    }
}

TEST(Play, APaneThatIsOpenIsNotOpenedAgain) {
    const Program program;

    const auto result =
        program.run({"play", "-"}, R"({"steps": [{"do": "open"}, {"do": "open"}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: step 1 (open): the page is open already\n");
}

TEST(Play, NothingIsSharedWithoutASheet) {
    const Program program;

    const auto result =
        program.run({"play", "-"}, R"({"steps": [{"do": "share", "outcome": "sent"}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "settingsctl: step 0 (share): no share sheet is presented\n");
}

TEST(Play, AnInterruptedScenarioLeavesNothingBehind) {
    const Program program;
    std::string scenario = R"({"steps": [{"do": "open"})";
    for (int step = 0; step < 2000; ++step) {
        scenario += R"(, {"do": "list"})";
    }
    const auto file = program.write("long.json", scenario + "]}");
    for (const int signal : {SIGINT, SIGTERM, SIGHUP}) {
        // Nobody reads the trace to its end, so the program is still at it when the signal comes.
        std::array<int, 2> pipe{};
        ASSERT_EQ(::pipe2(pipe.data(), O_CLOEXEC), 0);
        const pid_t process = program.start({"play", file.string()}, pipe[1]);
        ::close(pipe[1]);
        char first = '\0';
        ASSERT_EQ(::read(pipe[0], &first, 1), 1);
        EXPECT_FALSE(program.leftNothingBehind());

        ::kill(process, signal);
        int status = 0;
        ASSERT_EQ(::waitpid(process, &status, 0), process);

        EXPECT_EQ(exitStatusOf(status), -signal);
        EXPECT_TRUE(program.leftNothingBehind());
        ::close(pipe[0]);
    }
}

TEST(Play, AReaderThatGoesAwayEndsTheScenarioAndNothingIsLeft) {
    const Program program;
    std::string scenario = R"({"steps": [{"do": "open"})";
    for (int step = 0; step < 2000; ++step) {
        scenario += R"(, {"do": "list"})";
    }
    const auto file = program.write("long.json", scenario + "]}");
    std::array<int, 2> pipe{};
    ASSERT_EQ(::pipe2(pipe.data(), O_CLOEXEC), 0);
    const pid_t process = program.start({"play", file.string()}, pipe[1]);
    ::close(pipe[1]);
    ::close(pipe[0]);

    int status = 0;
    ASSERT_EQ(::waitpid(process, &status, 0), process);

    EXPECT_EQ(exitStatusOf(status), -SIGPIPE);
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(Play, TracesTheChangesOfARowThatBringsAnother) {
    const Program program;

    const auto result =
        playRows(program, R"(, {"do": "set", "row": "com.example.notes", "value": true},
                      {"do": "get", "row": "com.example.notes"},
                      {"do": "set", "row": "Notes", "value": false})");

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(eventsOfStep(result.output, 1),
              R"({"event":"fetchAccount","queue":"main","account":"primary"}
{"event":"account","queue":"main","op":"setEnabled:forDataclass:","account":"primary","dataclass":"kAccountDataclassNotes","value":true}
{"event":"table","queue":"main","op":"beginUpdates","rows":[],"animated":true}
{"event":"table","queue":"main","op":"insert","rows":["Details"],"after":"com.example.notes","animated":true}
{"event":"table","queue":"main","op":"endUpdates","rows":[],"animated":true}
{"event":"table","queue":"main","op":"reloadRow","rows":["com.example.notes"],"animated":false}
)");
    EXPECT_EQ(eventsOfStep(result.output, 2),
              R"({"event":"value","queue":"main","row":"com.example.notes","value":true})"
              "\n");
    EXPECT_NE(eventsOfStep(result.output, 3)
                  .find(R"({"event":"table","queue":"main","op":"remove","rows":["Details"],)"
                        R"("animated":true})"),
              std::string::npos);
}

TEST(Play, WaitsAfterAStepForWhatItHasSetGoing) {
    const Program program;

    const auto result = playRows(program, R"(, {"do": "tap", "row": "Later"}, {"do": "list"})");

    EXPECT_EQ(eventsOfStep(result.output, 1),
              R"({"event":"table","queue":"main","op":"append","rows":["Arrived"],"animated":true})"
              "\n");
    EXPECT_NE(eventsOfStep(result.output, 2).find("Arrived"), std::string::npos);
}

TEST(Play, TracesThatThePaneReloadsItsParentAndLeaves) {
    const Program program;

    const auto result =
        playRows(program, R"(, {"do": "tap", "row": "Reload Parent"}, {"do": "tap", "row": "Leave"},
                      {"do": "list"})");

    EXPECT_EQ(eventsOfStep(result.output, 1),
              R"({"event":"parent","queue":"main","op":"reloadSpecifiers"})"
              "\n");
    EXPECT_EQ(eventsOfStep(result.output, 2),
              R"({"event":"dismiss","queue":"main","what":"pane","animated":true})"
              "\n");
    EXPECT_EQ(result.messages, "settingsctl: step 3 (list): no page is open\n");
}

TEST(Play, ARowWithoutAValueIsPrintedAsNull) {
    const Program program;

    const auto result = playRows(program, R"(, {"do": "get", "row": "twin.one"},
                                               {"do": "get", "row": "Storage"})");

    EXPECT_EQ(eventsOfStep(result.output, 1),
              R"({"event":"value","queue":"main","row":"twin.one","value":null})"
              "\n");
    EXPECT_EQ(eventsOfStep(result.output, 2),
              R"({"event":"value","queue":"main","row":"Storage","value":"3 apps"})"
              "\n");
}

TEST(Play, ShowsAllTextsInTheLanguageAskedFor) {
    const Program program;

    const auto result =
        program.run({"--locale", "de-DE", "play", "-"}, R"({"steps": [{"do": "open"}]})");

    EXPECT_NE(result.output.find("Apps können"), std::string::npos);
}

TEST(Play, ABundleThatCannotBeLoadedFailsItsStep) {
    const Program program;

    const auto result = program.run({"--bundle", program.path("none").string(), "play", "-"},
                                    R"({"steps": [{"do": "open"}]})");

    EXPECT_EQ(result.status, 1);
    EXPECT_TRUE(result.messages.starts_with("settingsctl: step 0 (open): ")) << result.messages;
    EXPECT_NE(result.messages.find("none"), std::string::npos);
    EXPECT_TRUE(program.leftNothingBehind());
}

} // namespace
} // namespace nimbra::test
