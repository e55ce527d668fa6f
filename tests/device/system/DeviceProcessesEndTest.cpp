#include "device/files/Descriptor.h"
#include "device/system/DeviceProcesses.h"
#include "tests/device/Children.h"
#include "tests/device/system/ToolFixture.h"

#include <cerrno>
#include <csignal>
#include <future>
#include <poll.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>

// The header of glibc 2.36 does not say so itself.
extern "C" {
#include <sys/pidfd.h>
}

namespace nimbra::device {
namespace {

class DeviceProcessesEndTest : public test::ToolFixture {
protected:
    DeviceProcessesEndTest() {
        EXPECT_EQ(::mkfifo(pipe().c_str(), 0600), 0);
        write("trap 'echo asked; exit 4' TERM\n"
              "echo ready >\"$1\"\n"
              "while :; do read -r line <\"$1\"; done",
              "/polite");
        write("trap '' TERM\necho ready >\"$1\"\nread -r line <\"$1\"", "/stubborn");
    }

    [[nodiscard]] std::filesystem::path pipe() const { return root() / "pipe"; }

    /// Starts a program that never ends by itself and has got so far as to know what it does when
    /// it is asked to.
    [[nodiscard]] pid_t startLasting(const std::string& path) {
        const auto process = start({pipe().string()}, {}, path);
        EXPECT_TRUE(process);
        EXPECT_EQ(test::contentOf(pipe()), "ready\n");
        return process.value();
    }

    /// Waits until `process` has ended, whoever takes its status.
    static void awaitEnd(const Descriptor& process) {
        pollfd end{.fd = process.number(), .events = POLLIN, .revents = 0};
        EXPECT_EQ(::poll(&end, 1, -1), 1);
    }
    [[nodiscard]] static Descriptor watch(pid_t process) {
        Descriptor descriptor(::pidfd_open(process, 0));
        EXPECT_TRUE(descriptor.isOpen());
        return descriptor;
    }
};

TEST_F(DeviceProcessesEndTest, WhoWaitsGoesOnAndTheProgramIsAskedToEnd) {
    const pid_t process = startLasting("/polite");
    const Descriptor watched = watch(process);
    std::promise<std::expected<int, int>> waited;
    std::jthread waiter([&] { waited.set_value(processes().waitpid(process)); });

    processes().finish();

    EXPECT_EQ(waited.get_future().get(), std::unexpected(ECANCELED));
    awaitEnd(watched);
    EXPECT_EQ(output(), "asked\n");
    test::awaitNothingLeft(process);
}

TEST_F(DeviceProcessesEndTest, AProgramThatDoesNotListenHoldsNobodyUp) {
    const pid_t process = startLasting("/stubborn");
    std::promise<std::expected<int, int>> waited;
    std::jthread waiter([&] { waited.set_value(processes().waitpid(process)); });

    processes().finish();

    EXPECT_EQ(waited.get_future().get(), std::unexpected(ECANCELED));
    // It runs on, and when it ends nothing is left of it.
    EXPECT_EQ(::kill(process, SIGKILL), 0);
    test::awaitNothingLeft(process);
}

TEST_F(DeviceProcessesEndTest, ManyWhoWaitGoOn) {
    write("exec sleep infinity");
    std::vector<pid_t> started;
    std::vector<std::future<std::expected<int, int>>> waited;
    for (int count = 0; count < 20; ++count) {
        const auto process = start({}, std::vector<std::string>{"PATH=/usr/bin:/bin"});
        ASSERT_TRUE(process);
        started.push_back(*process);
        waited.push_back(std::async(std::launch::async, [this, process = *process] {
            return processes().waitpid(process);
        }));
    }

    processes().finish();

    for (auto& end : waited) {
        EXPECT_EQ(end.get(), std::unexpected(ECANCELED));
    }
    for (const pid_t process : started) {
        test::awaitNothingLeft(process);
    }
}

TEST_F(DeviceProcessesEndTest, AProgramThatNobodyHasWaitedForLeavesNothing) {
    write("exit 0");
    const auto process = start();
    ASSERT_TRUE(process);
    awaitEnd(watch(*process));

    endProcesses();

    EXPECT_EQ(::waitpid(*process, nullptr, WNOHANG), -1);
    EXPECT_EQ(errno, ECHILD);
}

TEST_F(DeviceProcessesEndTest, AfterTheEndNothingStartsAndNobodyWaits) {
    write("exit 0");
    const auto process = start();
    ASSERT_TRUE(process);
    std::filesystem::remove(root() / "out");
    processes().planSpawnOutcomes({ENOENT});

    processes().finish();
    processes().finish();

    EXPECT_EQ(start(), std::unexpected(ECANCELED));
    EXPECT_EQ(processes().waitpid(*process), std::unexpected(ECANCELED));
    test::awaitNothingLeft(*process);
}

TEST_F(DeviceProcessesEndTest, OneWhoStartsAndWaitsAtTheSameTimeAsTheEndGetsAnAnswer) {
    write("exec sleep infinity");
    for (int round = 0; round < 20; ++round) {
        DeviceProcesses own{DevicePaths(root())};
        std::vector<std::jthread> threads;
        for (int count = 0; count < 3; ++count) {
            threads.emplace_back([&own] {
                const auto process = own.posix_spawn(
                    {.path = "/tool",
                     .arguments = {"tool"},
                     .environment = std::vector<std::string>{"PATH=/usr/bin:/bin"}});
                const auto waited = process
                                        ? own.waitpid(*process)
                                        : std::expected<int, int>(std::unexpected(process.error()));
                EXPECT_EQ(waited, std::unexpected(ECANCELED));
            });
        }
        own.finish();
    }
    // Whatever was started has been asked to end: without that this would wait for ever.
    while (::waitid(P_ALL, 0, nullptr, WEXITED | WNOWAIT) == 0) {
        std::this_thread::yield();
    }
}

} // namespace
} // namespace nimbra::device
