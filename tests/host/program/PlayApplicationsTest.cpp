#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "tests/host/program/Program.h"

#include <array>
#include <chrono>
#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>
#include <vector>

namespace nimbra::test {
namespace {

constexpr const char* notesRunning = R"("device": {
    "accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                  "enabled": ["kAccountDataclassTidewater"]}],
    "apps": [{"identifier": "com.example.notes", "name": "Notes", "running": true}],
    "consent": [{"service": "kPRVServiceTidewater", "bundle": "com.example.notes",
                 "granted": true}]})";

TEST(PlayApplications, TheSwitchOfARunningApplicationIsTracedWithItsTermination) {
    const Program program;

    const auto result = program.run({"play", "-"}, std::string("{") + notesRunning + R"(,
        "steps": [{"do": "open"}, {"do": "set", "row": "com.example.notes", "value": false}]})");

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.messages, "");
    EXPECT_TRUE(result.output.ends_with(
        R"({"event":"step","queue":"main","index":1,"do":"set"}
{"event":"consent","queue":"main","op":"PRVAccessSetForBundle","service":"kPRVServiceTidewater","bundle":"com.example.notes","granted":false}
{"event":"terminate","queue":"main","bundle":"com.example.notes","reason":3,"report":false,"description":null}
)")) << result.output;
    EXPECT_NE(result.output.find(R"("icon":"com.example.notes")"), std::string::npos);
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(PlayApplications, AScenarioWhoseApplicationsComeAndGoLeavesNothingBehind) {
    const Program program;

    const auto result = program.run({"play", "-"}, std::string("{") + notesRunning + R"(,
        "steps": [{"do": "open"},
                  {"do": "change", "device": {"apps": [{"identifier": "com.example.notes"}]}},
                  {"do": "change", "device": {"apps": [
                      {"identifier": "com.example.notes", "running": true},
                      {"identifier": "com.example.clock", "running": true}]}},
                  {"do": "set", "row": "com.example.notes", "value": false}]})");

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_EQ(result.messages, "");
    EXPECT_TRUE(program.leftNothingBehind());
}

TEST(PlayApplications, NoApplicationIsRecordedOnADeviceThatIsKept) {
    const Program program;

    const auto result = program.run({"play", "--keep", program.path("kept").string(), "-"},
                                    std::string("{") + notesRunning + R"(, "steps": []})");

    EXPECT_EQ(result.status, 0);
    EXPECT_TRUE(std::filesystem::is_empty(program.path("kept/run/nimbra")));
}

/// The process of com.example.notes, in a scenario that is played in a temporary directory of
/// `program` or kept in "kept".
std::optional<device::Process> notesProcess(const Program& program) {
    for (const char* const directory : {"tmp", "kept"}) {
        if (!std::filesystem::exists(program.path(directory))) {
            continue;
        }
        for (const auto& entry :
             std::filesystem::recursive_directory_iterator(program.path(directory))) {
            if (entry.path().filename() == "com.example.notes.pid") {
                const auto record = device::ProcessRecord::parse(readWhole(entry.path()));
                auto process = device::Process::withNumber(record.value().process);
                EXPECT_TRUE(process);
                return process ? std::optional(std::move(*process)) : std::nullopt;
            }
        }
    }
    return std::nullopt;
}

TEST(PlayApplications, NoApplicationOutlivesAnInterruptedScenario) {
    std::string scenario = std::string("{") + notesRunning + R"(, "steps": [{"do": "open"})";
    for (int step = 0; step < 2000; ++step) {
        scenario += R"(, {"do": "list"})";
    }
    for (const bool isKept : {false, true}) {
        for (const int signal : {SIGTERM, SIGKILL}) {
            const Program program;
            const auto file = program.write("long.json", scenario + "]}");
            std::vector<std::string> arguments{"play", file.string()};
            if (isKept) {
                arguments.insert(arguments.end(), {"--keep", program.path("kept").string()});
            }
            // Nobody reads the trace to its end, so the program is still at it when the signal
            // comes.
            std::array<int, 2> pipe{};
            ASSERT_EQ(::pipe2(pipe.data(), O_CLOEXEC), 0);
            const pid_t process = program.start(arguments, pipe[1]);
            ::close(pipe[1]);
            char first = '\0';
            ASSERT_EQ(::read(pipe[0], &first, 1), 1);
            const auto notes = notesProcess(program);
            ASSERT_TRUE(notes);
            EXPECT_FALSE(notes->awaitEnd(std::chrono::milliseconds(0)));

            ::kill(process, signal);
            int status = 0;
            ASSERT_EQ(::waitpid(process, &status, 0), process);

            EXPECT_EQ(exitStatusOf(status), -signal);
            EXPECT_TRUE(notes->awaitEnd(std::chrono::hours(1)));
            if (signal == SIGTERM) {
                EXPECT_FALSE(notesProcess(program));
                EXPECT_TRUE(program.leftNothingBehind());
            }
            ::close(pipe[0]);
        }
    }
}

} // namespace
} // namespace nimbra::test
