#include "host/core/scenario/RunningApplications.h"

#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/files/Files.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <sys/wait.h>

namespace nimbra::host {
namespace {

using device::Process;
using device::ProcessRecord;
constexpr std::chrono::milliseconds atOnce(0);
constexpr std::chrono::hours ages(24);

/// Whether this process has no children any more, not even ones that nobody has waited for.
bool hasNoChildren() {
    return ::waitpid(-1, nullptr, WNOHANG) == -1 && errno == ECHILD;
}

class RunningApplicationsTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path file(const std::string& application) const {
        return root() / "run/nimbra" / (application + ".pid");
    }
    [[nodiscard]] ProcessRecord record(const std::string& application) const {
        const auto content = device::readFile(file(application));
        EXPECT_TRUE(content) << content.error();
        const auto record = ProcessRecord::parse(content.value_or(""));
        EXPECT_TRUE(record) << content.value_or("");
        return record.value_or(ProcessRecord());
    }
    [[nodiscard]] Process process(const std::string& application) const {
        return Process::withNumber(record(application).process).value();
    }

    [[nodiscard]] RunningApplications& applications() { return *_applications; }
    void letGo() { _applications.reset(); }

private:
    test::TemporaryDirectory _directory;
    std::optional<RunningApplications> _applications{_directory.path()};
};

TEST_F(RunningApplicationsTest, EachIsAProcessThatIsRecorded) {
    ASSERT_TRUE(applications().setRunning({"com.example.notes", "a/b"}));

    for (const std::string name : {"com.example.notes", "a%2Fb"}) {
        const Process running = process(name);
        EXPECT_EQ(record(name).startTime, running.startTime());
        EXPECT_TRUE(record(name).startTime);
        EXPECT_FALSE(running.awaitEnd(atOnce));
    }
    EXPECT_NE(record("com.example.notes").process, record("a%2Fb").process);
}

TEST_F(RunningApplicationsTest, TheyListenToASignalAlthoughThisProgramIgnoresIt) {
    const auto earlier = std::signal(SIGTERM, SIG_IGN);
    ASSERT_TRUE(applications().setRunning({"notes"}));
    static_cast<void>(std::signal(SIGTERM, earlier));
    const Process running = process("notes");

    EXPECT_TRUE(running.send(SIGTERM));

    EXPECT_TRUE(running.awaitEnd(ages));
}

TEST_F(RunningApplicationsTest, OnlyThoseThatAreNamedGoOn) {
    ASSERT_TRUE(applications().setRunning({"notes", "clock"}));
    const ProcessRecord notes = record("notes");
    const Process clock = process("clock");

    ASSERT_TRUE(applications().setRunning({"notes", "maps"}));

    EXPECT_EQ(record("notes"), notes);
    EXPECT_FALSE(process("notes").awaitEnd(atOnce));
    EXPECT_FALSE(process("maps").awaitEnd(atOnce));
    EXPECT_TRUE(clock.awaitEnd(atOnce));
    EXPECT_FALSE(std::filesystem::exists(file("clock")));
}

TEST_F(RunningApplicationsTest, OneThatWasEndedIsStartedAnew) {
    ASSERT_TRUE(applications().setRunning({"notes"}));
    const Process ended = process("notes");
    EXPECT_TRUE(ended.send(SIGTERM));
    EXPECT_TRUE(ended.awaitEnd(ages));

    ASSERT_TRUE(applications().setRunning({"notes"}));

    EXPECT_FALSE(process("notes").awaitEnd(atOnce));
}

TEST_F(RunningApplicationsTest, AllEndAndLeaveNothing) {
    ASSERT_TRUE(applications().setRunning({"notes", "clock"}));
    const Process notes = process("notes");
    const Process clock = process("clock");
    EXPECT_TRUE(clock.send(SIGTERM));

    letGo();

    EXPECT_TRUE(notes.awaitEnd(atOnce));
    EXPECT_TRUE(clock.awaitEnd(atOnce));
    EXPECT_TRUE(hasNoChildren());
    EXPECT_TRUE(std::filesystem::is_empty(root() / "run/nimbra"));
}

TEST_F(RunningApplicationsTest, AllEndAlsoWhereTheSystemReapsThem) {
    const auto earlier = std::signal(SIGCHLD, SIG_IGN);
    ASSERT_TRUE(applications().setRunning({"notes", "clock", "maps"}));
    const Process notes = process("notes");
    const Process clock = process("clock");
    EXPECT_TRUE(clock.send(SIGTERM));
    EXPECT_TRUE(clock.awaitEnd(ages));
    ASSERT_TRUE(applications().setRunning({"notes", "clock"}));
    const Process again = process("clock");
    EXPECT_FALSE(again.awaitEnd(atOnce));
    EXPECT_TRUE(again.send(SIGTERM));
    EXPECT_TRUE(again.awaitEnd(ages));

    letGo();
    static_cast<void>(std::signal(SIGCHLD, earlier));

    EXPECT_TRUE(notes.awaitEnd(atOnce));
    EXPECT_TRUE(hasNoChildren());
    EXPECT_TRUE(std::filesystem::is_empty(root() / "run/nimbra"));
}

TEST_F(RunningApplicationsTest, NoneStartsWhenAllHaveBeenEndedForGood) {
    ASSERT_TRUE(applications().setRunning({"notes"}));
    applications().end();
    EXPECT_TRUE(hasNoChildren());

    EXPECT_TRUE(applications().setRunning({"notes"}));

    EXPECT_TRUE(hasNoChildren());
    EXPECT_FALSE(std::filesystem::exists(file("notes")));
}

TEST_F(RunningApplicationsTest, ARecordThatCannotBeWrittenIsAnErrorAndNothingIsLeft) {
    std::filesystem::create_directories(file("notes"));

    const auto running = applications().setRunning({"notes"});

    ASSERT_FALSE(running);
    EXPECT_EQ(running.error().description,
              file("notes").string() + ": cannot be written: Is a directory");
    letGo();
    EXPECT_TRUE(hasNoChildren());
}

TEST_F(RunningApplicationsTest, ADirectoryThatCannotBeMadeIsAnErrorAndNothingStarts) {
    std::ofstream(root() / "run") << "a file";

    const auto running = applications().setRunning({"notes"});

    ASSERT_FALSE(running);
    EXPECT_EQ(running.error().description,
              (root() / "run/nimbra").string() + ": cannot be made: Not a directory");
    EXPECT_TRUE(hasNoChildren());
}

} // namespace
} // namespace nimbra::host
