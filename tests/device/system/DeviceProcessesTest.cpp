#include "device/system/DeviceProcesses.h"

#include "device/files/Descriptor.h"
#include "tests/device/system/ToolFixture.h"

#include <array>
#include <cerrno>
#include <csignal>
#include <pthread.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::device {
namespace {

using test::writeTestFile;

class DeviceProcessesTest : public test::ToolFixture {};

TEST_F(DeviceProcessesTest, AProgramGetsItsArgumentsAsTheyAre) {
    write("printf '[%s]' \"$@\"");

    EXPECT_EQ(run({"diagnose", "", "a 'b'\n\"c\"", "--x"}), 0);

    EXPECT_EQ(output(), "[diagnose][][a 'b'\n\"c\"][--x]");
}

TEST_F(DeviceProcessesTest, TheFirstArgumentIsWhatAProgramIsCalled) {
    std::filesystem::copy_file("/bin/sh", root() / "tool");
    SpawnFileActions actions;
    actions.addopen(1, "/out", O_WRONLY | O_CREAT, 0644);

    const auto process = processes().posix_spawn(
        {.path = "/tool", .fileActions = actions, .arguments = {"a name", "-c", "echo \"$0\""}});

    ASSERT_TRUE(process);
    EXPECT_EQ(processes().waitpid(*process), 0);
    EXPECT_EQ(output(), "a name\n");
}

TEST_F(DeviceProcessesTest, WithoutAnEnvironmentAProgramHasAnEmptyOne) {
    write("exec 3</proc/self/environ && while read -r line <&3; do :; done\n"
          "printf '%s' \"$HOME|$GREETING|$USER\"");
    ::setenv("GREETING", "this process's", 1);

    EXPECT_EQ(run(), 0);
    EXPECT_EQ(output(), "||");
    EXPECT_EQ(run({}, std::vector<std::string>{"GREETING=hello there", "USER="}), 0);
    EXPECT_EQ(output(), "|hello there|");

    ::unsetenv("GREETING");
}

TEST_F(DeviceProcessesTest, TheStatusSaysHowAProgramHasEnded) {
    write("ulimit -c 0\n[ -z \"$1\" ] || kill -\"$1\" $$\nexit 3");

    const auto exited = start();
    const auto killed = start({"9"});
    const auto crashed = start({"11"});
    ASSERT_TRUE(exited && killed && crashed);

    EXPECT_EQ(processes().waitpid(*crashed), 11);
    EXPECT_EQ(processes().waitpid(*killed), 9);
    EXPECT_EQ(processes().waitpid(*exited), 3 << 8);
}

TEST_F(DeviceProcessesTest, FilesAreOpenedOnTheDeviceButForTheMachinesNowhere) {
    write("echo out; echo err >&2; read -r line; echo \"$line\"");
    writeTestFile(root() / "in", "what stands in it\n");
    std::filesystem::create_symlink("/real", root() / "link");
    std::filesystem::create_directory(root() / "real");
    SpawnFileActions actions;
    actions.addopen(0, "/in", O_RDONLY, 0);
    actions.addopen(1, "/link/../link/out", O_WRONLY | O_CREAT | O_EXCL, 0600);
    actions.addopen(2, "/dev/null", O_RDWR, 0666);

    const auto process =
        processes().posix_spawn({.path = "/tool", .fileActions = actions, .arguments = {"tool"}});

    ASSERT_TRUE(process);
    EXPECT_EQ(processes().waitpid(*process), 0);
    EXPECT_EQ(test::contentOf(root() / "real/out"), "out\nwhat stands in it\n");
    EXPECT_EQ(std::filesystem::status(root() / "real/out").permissions(),
              std::filesystem::perms(0600));
    EXPECT_FALSE(std::filesystem::exists(root() / "dev"));
}

TEST_F(DeviceProcessesTest, AProgramReadsWhatThisProcessWouldReadNext) {
    write("read -r line; echo \"$line\"");
    writeTestFile(root() / "in", "the first line\nthe second\n");
    const Descriptor earlier(::dup(STDIN_FILENO));
    {
        const Descriptor input(::open((root() / "in").c_str(), O_RDONLY));
        ASSERT_TRUE(earlier.isOpen() && input.isOpen());
        ASSERT_EQ(::dup2(input.number(), STDIN_FILENO), STDIN_FILENO);
    }

    const int status = run();

    EXPECT_EQ(::dup2(earlier.number(), STDIN_FILENO), STDIN_FILENO);
    EXPECT_EQ(status, 0);
    EXPECT_EQ(output(), "the first line\n");
}

TEST_F(DeviceProcessesTest, AProgramHasNoneOfThisProcessesOtherDescriptors) {
    // Without CLOEXEC, as a library may open one.
    const Descriptor inherited(::open("/dev/null", O_RDWR));
    const Descriptor high(::fcntl(inherited.number(), F_DUPFD, 200));
    ASSERT_TRUE(inherited.isOpen() && high.isOpen());
    write("for number in 3 4 5 6 7 8 9; do\n"
          "  if (: <&$number) 2>/dev/null; then echo $number; fi\n"
          "done\n"
          "[ -e /proc/self/fd/200 ] && echo 200\n"
          "exit 0");
    SpawnFileActions actions;
    actions.addopen(1, "/out", O_WRONLY | O_CREAT, 0644);
    actions.addopen(5, "/dev/null", O_RDONLY, 0);

    const auto process =
        processes().posix_spawn({.path = "/tool", .fileActions = actions, .arguments = {"tool"}});

    ASSERT_TRUE(process);
    EXPECT_EQ(processes().waitpid(*process), 0);
    EXPECT_EQ(output(), "5\n");
}

TEST_F(DeviceProcessesTest, AProgramStartsWithTheUsualSignals) {
    write("while read -r name value; do\n"
          "  case $name in SigBlk:|SigIgn:) echo \"$name $value\" ;; esac\n"
          "done </proc/self/status");
    const auto earlierPipe = std::signal(SIGPIPE, SIG_IGN);
    const auto earlierTerm = std::signal(SIGTERM, SIG_IGN);
    sigset_t blocked{};
    sigset_t earlier{};
    ::sigfillset(&blocked);
    ::pthread_sigmask(SIG_SETMASK, &blocked, &earlier);

    const int status = run();

    ::pthread_sigmask(SIG_SETMASK, &earlier, nullptr);
    static_cast<void>(std::signal(SIGTERM, earlierTerm));
    static_cast<void>(std::signal(SIGPIPE, earlierPipe));
    EXPECT_EQ(status, 0);
    // But for two that belong to the C library, bits 31 and 32.
    const std::string lines = output();
    EXPECT_TRUE(lines == "SigBlk: 0000000000000000\nSigIgn: 0000000000000000\n" ||
                lines == "SigBlk: 0000000000000000\nSigIgn: 0000000180000000\n")
        << lines;
}

TEST_F(DeviceProcessesTest, WhatCannotBeStartedIsAnErrno) {
    write("exit 0", "/usr/bin/tool");
    writeTestFile(root() / "text", "#!/bin/sh\n");
    std::filesystem::permissions(root() / "text", std::filesystem::perms(0644));
    writeTestFile(root() / "garbage", "\x7f"
                                      "ELF, but no more");
    std::filesystem::permissions(root() / "garbage", std::filesystem::perms(0755));
    std::filesystem::create_symlink("circle", root() / "circle");
    const auto failure = [this](const std::string& path) {
        const auto process = processes().posix_spawn({.path = path, .arguments = {path}});
        return process ? 0 : process.error();
    };

    EXPECT_EQ(failure("/missing"), ENOENT);
    EXPECT_EQ(failure(""), ENOENT);
    EXPECT_EQ(failure("/bin/sh"), ENOENT);
    EXPECT_EQ(failure("/text"), EACCES);
    EXPECT_EQ(failure("/usr"), EACCES);
    EXPECT_EQ(failure("/text/below"), ENOTDIR);
    EXPECT_EQ(failure("/garbage"), ENOEXEC);
    EXPECT_EQ(failure("/circle"), ELOOP);
    EXPECT_EQ(failure(std::string("/usr/bin/tool\0x", 15)), EINVAL);
}

TEST_F(DeviceProcessesTest, WordsAndFilesThatCannotBeGivenAreAnErrno) {
    write("exit 0");
    const std::string withNull("a\0b", 3);
    const auto failure = [this](const SpawnRequest& request) {
        const auto process = processes().posix_spawn(request);
        return process ? 0 : process.error();
    };
    SpawnFileActions missing;
    missing.addopen(1, "/missing/out", O_WRONLY | O_CREAT, 0644);
    SpawnFileActions impossible;
    impossible.addopen(-1, "/dev/null", O_RDWR, 0);
    SpawnFileActions unnamed;
    unnamed.addopen(1, withNull, O_RDWR, 0);

    EXPECT_EQ(failure({.path = "/tool", .arguments = {"tool", withNull}}), EINVAL);
    EXPECT_EQ(failure({.path = "/tool",
                       .arguments = {"tool"},
                       .environment = std::vector<std::string>{withNull}}),
              EINVAL);
    EXPECT_EQ(failure({.path = "/tool", .fileActions = missing, .arguments = {"tool"}}), ENOENT);
    EXPECT_EQ(failure({.path = "/tool", .fileActions = impossible, .arguments = {"tool"}}), EBADF);
    EXPECT_EQ(failure({.path = "/tool", .fileActions = unnamed, .arguments = {"tool"}}), EINVAL);
}

TEST_F(DeviceProcessesTest, AProgramThatCannotBeWatchedIsEndedAgain) {
    write("exec sleep infinity");
    const Descriptor next(::open("/dev/null", O_RDWR | O_CLOEXEC));
    rlimit earlier{};
    ASSERT_EQ(::getrlimit(RLIMIT_NOFILE, &earlier), 0);
    rlimit few = earlier;
    // Room for what the new process opens as one of its three, and for no other descriptor here.
    few.rlim_cur = static_cast<rlim_t>(next.number()) + 1;
    SpawnFileActions actions;
    actions.addopen(1, "/dev/null", O_RDWR, 0);
    actions.addopen(2, "/dev/null", O_RDWR, 0);

    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &few), 0);
    const auto process =
        processes().posix_spawn({.path = "/tool", .fileActions = actions, .arguments = {"tool"}});
    ASSERT_EQ(::setrlimit(RLIMIT_NOFILE, &earlier), 0);

    ASSERT_FALSE(process);
    EXPECT_EQ(process.error(), EMFILE);
    EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1);
    EXPECT_EQ(errno, ECHILD);
}

TEST_F(DeviceProcessesTest, OnlyOneWaitsForAProgramAndOnlyForOneThatWasStartedHere) {
    write("exit 0");
    const auto process = start();
    ASSERT_TRUE(process);

    EXPECT_EQ(processes().waitpid(*process), 0);
    EXPECT_EQ(processes().waitpid(*process), std::unexpected(ECHILD));
    EXPECT_EQ(processes().waitpid(::getppid()), std::unexpected(ECHILD));
    EXPECT_EQ(processes().waitpid(-1), std::unexpected(ECHILD));
}

TEST_F(DeviceProcessesTest, PlannedFailuresAreUsedUpInOrderAndStartNothing) {
    write("exit 0");
    processes().planSpawnOutcomes({ENOMEM});
    processes().planSpawnOutcomes({ENOENT, std::nullopt, EAGAIN});

    EXPECT_EQ(start(), std::unexpected(ENOENT));
    EXPECT_FALSE(std::filesystem::exists(root() / "out"));
    EXPECT_EQ(run(), 0);
    EXPECT_EQ(start(), std::unexpected(EAGAIN));
    EXPECT_EQ(run(), 0);
}

} // namespace
} // namespace nimbra::device
