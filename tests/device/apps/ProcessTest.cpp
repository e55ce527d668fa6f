#include "device/apps/Process.h"

#include "tests/device/apps/ChildProcess.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <chrono>
#include <ctime>
#include <filesystem>
#include <gtest/gtest.h>
#include <limits>

namespace nimbra::device {
namespace {

using test::ChildProcess;
constexpr std::chrono::milliseconds atOnce(0);

/// The ticks of the clock that processes' start times are told in.
std::uint64_t ticksNow() {
    timespec now{};
    ::clock_gettime(CLOCK_BOOTTIME, &now);
    const auto perSecond = static_cast<std::uint64_t>(::sysconf(_SC_CLK_TCK));
    constexpr std::uint64_t nanosecondsPerSecond = 1'000'000'000;
    return static_cast<std::uint64_t>(now.tv_sec) * perSecond +
           static_cast<std::uint64_t>(now.tv_nsec) * perSecond / nanosecondsPerSecond;
}

TEST(Process, TellsWhenItStartedWhateverItsProgramIsCalled) {
    const test::TemporaryDirectory directory;
    const auto program = directory.path() / ") 1 2 (3";
    std::filesystem::create_symlink("/bin/sleep", program);
    const auto before = ticksNow();
    const ChildProcess child(ChildProcess::Manner::listens, program);
    const auto after = ticksNow();

    const auto startTime = Process::withNumber(child.number()).value().startTime();

    ASSERT_TRUE(startTime);
    EXPECT_GE(*startTime, before);
    EXPECT_LE(*startTime, after);
}

TEST(Process, HasEndedWhenNothingOfItRuns) {
    const ChildProcess child;
    const auto process = Process::withNumber(child.number());
    ASSERT_TRUE(process);
    EXPECT_FALSE(process->awaitEnd(atOnce));

    EXPECT_TRUE(process->send(SIGTERM));

    EXPECT_TRUE(process->awaitEnd(std::chrono::hours(1)));
}

TEST(Process, StaysTheOneItWasWhenItHasGone) {
    ChildProcess child;
    const auto process = Process::withNumber(child.number());
    ASSERT_TRUE(process);
    child.kill();
    child.await();

    EXPECT_FALSE(process->send(SIGTERM));
    EXPECT_TRUE(process->awaitEnd(atOnce));
    EXPECT_EQ(process->startTime(), std::nullopt);
}

TEST(Process, IsNoneWhereNothingHasTheNumber) {
    // Beyond the highest number that any machine gives.
    EXPECT_EQ(Process::withNumber(std::numeric_limits<pid_t>::max()).error(), ESRCH);
}

} // namespace
} // namespace nimbra::device
