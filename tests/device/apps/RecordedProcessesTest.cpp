#include "device/apps/RecordedProcesses.h"

#include "device/apps/DeviceAppTerminator.h"
#include "device/apps/Process.h"
#include "device/apps/ProcessRecord.h"
#include "device/system/DeviceWorkQueues.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/apps/ChildProcess.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <chrono>
#include <cstddef>
#include <filesystem>
#include <gtest/gtest.h>
#include <linux/filter.h>
#include <linux/seccomp.h>
#include <map>
#include <optional>
#include <string>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <thread>
#include <vector>

namespace nimbra::device {
namespace {

using test::ChildProcess;
using Lines = std::vector<std::string>;
constexpr std::chrono::hours ages(24);

/// From now on the system refuses this thread's signals, as it does those to another user's
/// processes.
void forbidSignals() {
    std::array<sock_filter, 4> instructions{
        {BPF_STMT(BPF_LD | BPF_W | BPF_ABS, offsetof(seccomp_data, nr)),
         BPF_JUMP(BPF_JMP | BPF_JEQ | BPF_K, SYS_pidfd_send_signal, 0, 1),
         BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ERRNO | EPERM),
         BPF_STMT(BPF_RET | BPF_K, SECCOMP_RET_ALLOW)}};
    const sock_fprog program{.len = instructions.size(), .filter = instructions.data()};
    EXPECT_EQ(::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0), 0);
    EXPECT_EQ(::prctl(PR_SET_SECCOMP, SECCOMP_MODE_FILTER, &program), 0);
}

class RecordedProcessesTest : public testing::Test {
protected:
    RecordedProcessesTest() { std::filesystem::create_directories(record("any").parent_path()); }

    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path record(const std::string& application) const {
        return root() / "run/nimbra" / (application + ".pid");
    }
    void write(const std::string& content, const std::string& application = "notes") const {
        test::writeTestFile(record(application), content);
    }
    [[nodiscard]] bool isRecorded(const std::string& application = "notes") const {
        return std::filesystem::exists(std::filesystem::symlink_status(record(application)));
    }

    /// The record of `child`, with a start time that is off by `difference`.
    static std::string recordOf(const ChildProcess& child, std::uint64_t difference = 0) {
        const auto startTime = Process::withNumber(child.number()).value().startTime().value();
        return ProcessRecord{.process = child.number(), .startTime = startTime + difference}.text();
    }

    /// Asks for the end of `application`; one that does not listen has the `grace` of the first.
    void terminate(const std::string& application = "notes",
                   std::chrono::milliseconds grace = ages) {
        if (!_terminator) {
            _terminator.emplace(DeviceAppTerminator::waysOn(DevicePaths(root()), _log), _queues,
                                _log, grace);
        }
        _terminator->terminateApplication(BundleIdentifier(application), {.reason = 3});
    }
    void finish() { _queues.finish(); }
    [[nodiscard]] Lines logged() const { return _log.lines(); }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    test::PumpedQueue _mainQueue{"main"};
    DeviceWorkQueues _queues{_mainQueue};
    std::optional<DeviceAppTerminator> _terminator;
};

TEST_F(RecordedProcessesTest, AnApplicationIsAskedToEndAndItsRecordGoes) {
    ChildProcess child;
    write(recordOf(child));

    terminate();
    finish();

    EXPECT_EQ(child.await(), SIGTERM);
    EXPECT_FALSE(isRecorded());
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, AnApplicationThatDoesNotListenIsKilled) {
    ChildProcess child(ChildProcess::Manner::ignoresTerm);
    write(recordOf(child));

    terminate("notes", std::chrono::milliseconds(0));
    finish();

    EXPECT_EQ(child.await(), SIGKILL);
    EXPECT_FALSE(isRecorded());
}

TEST_F(RecordedProcessesTest, ANumberIsEnoughWhereTheRecordIsYoungerThanTheProcess) {
    ChildProcess child;
    write(std::to_string(child.number()) + '\n');

    terminate();
    finish();

    EXPECT_EQ(child.await(), SIGTERM);
    EXPECT_FALSE(isRecorded());
}

TEST_F(RecordedProcessesTest, AProcessThatGotTheNumberOfAnotherSurvives) {
    ChildProcess child;
    write(recordOf(child, 1));

    terminate();
    finish();

    EXPECT_TRUE(child.isRunning());
    EXPECT_FALSE(isRecorded());
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, AProcessThatIsYoungerThanTheRecordSurvives) {
    using std::chrono::file_clock;
    const auto anHourAgo = file_clock::now() - std::chrono::hours(1);
    const file_clock::time_point beforeTheEpoch =
        file_clock::from_sys(std::chrono::sys_seconds(-std::chrono::hours(24)));
    ChildProcess child;
    std::vector<std::string> applications;
    for (const auto& written : {anHourAgo, beforeTheEpoch}) {
        for (const auto& content : {std::to_string(child.number()), recordOf(child)}) {
            const auto& name = applications.emplace_back(std::to_string(applications.size()));
            write(content, name);
            std::filesystem::last_write_time(record(name), written);
            terminate(name);
        }
    }
    finish();

    EXPECT_TRUE(child.isRunning());
    for (const std::string& application : applications) {
        EXPECT_FALSE(isRecorded(application));
    }
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, TheRecordOfAProcessThatHasEndedGoes) {
    ChildProcess reaped;
    write(recordOf(reaped), "reaped");
    const ChildProcess unreaped;
    write(recordOf(unreaped), "unreaped");
    reaped.kill();
    reaped.await();
    unreaped.kill();
    unreaped.awaitUnreaped();

    terminate("reaped");
    terminate("unreaped");
    finish();

    EXPECT_FALSE(isRecorded("reaped"));
    EXPECT_FALSE(isRecorded("unreaped"));
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, ThisProcessAndTheFirstOnesAreLeftAlone) {
    // With start times that are not theirs: anybody else's record would go.
    for (const pid_t process : {0, 1, ::getpid()}) {
        write(ProcessRecord{.process = process, .startTime = 18446744073709551615U}.text(),
              std::to_string(process));
        terminate(std::to_string(process));
    }
    finish();

    EXPECT_TRUE(isRecorded("0"));
    EXPECT_TRUE(isRecorded("1"));
    EXPECT_TRUE(isRecorded(std::to_string(::getpid())));
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, NothingHappensWithoutARecord) {
    terminate();
    finish();
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, NothingHappensOnADeviceWithoutRecords) {
    std::filesystem::remove_all(root() / "run");
    terminate();
    finish();
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, AnIdentifierIsNeverAPath) {
    ChildProcess child;
    write(recordOf(child), "..%2Fnotes");

    terminate("../notes");
    finish();

    EXPECT_EQ(child.await(), SIGTERM);
}

TEST_F(RecordedProcessesTest, AnIdentifierThatIsTooLongForAFileHasNoRecord) {
    terminate(std::string(1000, 'a'));
    finish();
    EXPECT_EQ(logged(), Lines{});
}

TEST_F(RecordedProcessesTest, ARecordThatCannotBeReachedIsTold) {
    using std::filesystem::perms;
    std::filesystem::permissions(root(), perms(0755));
    ChildProcess child;
    write(recordOf(child));
    const auto other = root() / "other";
    std::filesystem::create_directory(other);
    std::filesystem::permissions(record("notes").parent_path(), perms::none);
    {
        // Root can reach everything, so the test is somebody else for a while.
        const test::ReadOnly readOnly(other);
        terminate();
        finish();
    }
    std::filesystem::permissions(record("notes").parent_path(), perms::owner_all);

    EXPECT_TRUE(child.isRunning());
    EXPECT_EQ(logged(), Lines{"/run/nimbra/notes.pid: cannot be read: Permission denied"});
}

TEST_F(RecordedProcessesTest, AProcessThatMayNotBeSignalledIsTold) {
    ChildProcess child;
    write(recordOf(child));
    test::RecordingLog log;

    std::thread([&] {
        forbidSignals();
        RecordedProcesses processes(DevicePaths(root()), log);
        EXPECT_FALSE(processes.askToEnd(BundleIdentifier("notes")));
    }).join();

    EXPECT_EQ(log.lines(), Lines{"/run/nimbra/notes.pid: its process cannot be asked to end: "
                                 "Operation not permitted"});
    EXPECT_TRUE(child.isRunning());
    EXPECT_TRUE(isRecorded());
}

TEST_F(RecordedProcessesTest, AMalformedRecordIsToldAndStays) {
    const std::map<std::string, std::string> contents{{"blank", ""},      {"negative", "-5"},
                                                      {"words", "notes"}, {"large", "2147483648"},
                                                      {"long", "1 2 3"},  {"odd", "4711 5x"}};
    Lines expected;
    for (const auto& [application, content] : contents) {
        write(content, application);
        terminate(application);
        expected.push_back("/run/nimbra/" + application +
                           ".pid: expected a process's number and start time, found \"" + content +
                           '"');
    }
    finish();

    EXPECT_EQ(logged(), expected);
    for (const auto& [application, content] : contents) {
        EXPECT_EQ(test::contentOf(record(application)), content);
        EXPECT_TRUE(isRecorded(application));
    }
}

TEST_F(RecordedProcessesTest, ARecordIsReadNoFurtherThanARecordGoes) {
    const ChildProcess child;
    const std::string content = recordOf(child) + std::string(1'000'000, ' ');
    write(content);

    terminate();
    finish();

    EXPECT_EQ(logged(), Lines{"/run/nimbra/notes.pid: is larger than 64 bytes"});
}

TEST_F(RecordedProcessesTest, APipeIsNotWaitedFor) {
    ASSERT_EQ(::mkfifo(record("notes").c_str(), S_IRUSR | S_IWUSR), 0);

    terminate();
    finish();

    EXPECT_EQ(logged(), Lines{"/run/nimbra/notes.pid: is not a plain file"});
    EXPECT_TRUE(isRecorded());
}

TEST_F(RecordedProcessesTest, ALinkIsNotFollowed) {
    ChildProcess child;
    const test::TemporaryDirectory elsewhere;
    test::writeTestFile(elsewhere.path() / "notes.pid", recordOf(child));
    std::filesystem::create_symlink(elsewhere.path() / "notes.pid", record("notes"));

    terminate();
    finish();

    EXPECT_TRUE(child.isRunning());
    EXPECT_EQ(logged(), Lines{"/run/nimbra/notes.pid: is not a plain file"});
    EXPECT_TRUE(std::filesystem::exists(elsewhere.path() / "notes.pid"));
}

TEST_F(RecordedProcessesTest, RecordsOutsideTheDeviceAreNotFound) {
    ChildProcess child;
    const test::TemporaryDirectory elsewhere;
    test::writeTestFile(elsewhere.path() / "notes.pid", recordOf(child));
    std::filesystem::remove(root() / "run/nimbra");
    std::filesystem::create_directory_symlink(elsewhere.path(), root() / "run/nimbra");

    terminate();
    finish();

    EXPECT_TRUE(child.isRunning());
    EXPECT_EQ(logged(), Lines{});
    EXPECT_TRUE(std::filesystem::exists(elsewhere.path() / "notes.pid"));
}

TEST_F(RecordedProcessesTest, OneApplicationThatDoesNotListenHoldsUpNoOther) {
    ChildProcess stubborn(ChildProcess::Manner::ignoresTerm);
    write(recordOf(stubborn), "stubborn");
    ChildProcess other;
    write(recordOf(other), "other");

    terminate("stubborn");
    terminate("other");

    EXPECT_EQ(other.await(), SIGTERM);
    EXPECT_TRUE(stubborn.isRunning());
    stubborn.kill();
    finish();
    EXPECT_FALSE(isRecorded("stubborn"));
}

TEST_F(RecordedProcessesTest, TheRecordOfANewProcessStaysWhenTheEarlierOneEnds) {
    ChildProcess earlier(ChildProcess::Manner::ignoresTerm);
    write(recordOf(earlier));
    ChildProcess other;
    write(recordOf(other), "other");
    terminate();
    terminate("other");
    // The queue has come by the first application when the second one ends.
    EXPECT_EQ(other.await(), SIGTERM);

    std::filesystem::rename(record("notes"), root() / "earlier");
    const ChildProcess later;
    write(recordOf(later));
    earlier.kill();
    finish();

    EXPECT_EQ(test::contentOf(record("notes")), recordOf(later));
}

TEST_F(RecordedProcessesTest, ARecordThatCannotBeRemovedIsTold) {
    std::filesystem::permissions(root(), std::filesystem::perms(0755));
    ChildProcess child;
    write(recordOf(child));
    ChildProcess ended;
    write(recordOf(ended), "ended");
    ended.kill();
    ended.await();
    {
        const test::ReadOnly readOnly(record("notes").parent_path());
        terminate();
        terminate("ended");
        finish();
    }

    EXPECT_EQ(child.await(), SIGTERM);
    Lines lines = logged();
    std::ranges::sort(lines);
    EXPECT_EQ(lines, (Lines{"/run/nimbra/ended.pid: cannot be removed: Permission denied",
                            "/run/nimbra/notes.pid: cannot be removed: Permission denied"}));
}

} // namespace
} // namespace nimbra::device
