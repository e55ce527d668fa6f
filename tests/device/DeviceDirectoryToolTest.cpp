#include "device/DeviceDirectory.h"
#include "tests/device/TestFiles.h"
#include "tests/support/ProgramRun.h"
#include "tests/support/TemporaryDirectory.h"

#include <csignal>
#include <gtest/gtest.h>
#include <string>
#include <sys/resource.h>
#include <vector>

namespace nimbra::device {
namespace {

using std::filesystem::perms;
using test::contentOf;
using test::runProgram;
using test::writeTestFile;
using Tool = DeviceDescription::Tool;
using Kind = Tool::Kind;

class DeviceDirectoryToolTest : public testing::Test {
protected:
    DeviceDirectoryToolTest() {
        std::filesystem::create_directory(place());
        // Says what it is called with, each word on a line, and what environment it has.
        writeTestFile(program(), "#!/bin/sh\nprintf '%s\\n' \"$@\"\nexit 7\n");
        std::filesystem::permissions(program(), perms::owner_all);
    }

    // A name that a shell would take apart in every way.
    [[nodiscard]] std::filesystem::path place() const {
        return _directory.path() / "it's \"$HOME\" `x` \\ *\n-";
    }
    [[nodiscard]] std::filesystem::path program() const { return place() / "the program"; }
    [[nodiscard]] std::filesystem::path root() const { return place() / "device"; }
    [[nodiscard]] std::filesystem::path tool() const { return root() / "usr/bin/mrctl"; }

    void create(const Tool& described) const {
        DeviceDescription description;
        description.tool = described;
        const auto created = createDeviceDirectory(root(), description, {.tool = program()});
        ASSERT_TRUE(created) << created.error();
    }
    [[nodiscard]] std::expected<void, Error> change(const Tool& described,
                                                    const DeviceParts& parts = {}) const {
        GivenDescription given;
        given.keys = {"tool"};
        given.description.tool = described;
        return changeDeviceDirectory(root(), given, parts);
    }

    /// Runs the tool as a program does that gives it no environment.
    [[nodiscard]] test::ProgramResult run(const std::vector<std::string>& arguments = {}) const {
        std::vector<std::string> command{tool().string()};
        command.insert(command.end(), arguments.begin(), arguments.end());
        return runProgram(command, {});
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(DeviceDirectoryToolTest, TheRealToolIsTheProgramOnThisDevice) {
    create({});

    const auto result = run({"diagnose", "--no-logarchive", "", "a 'b' \"c\" $d\n\\e"});

    EXPECT_EQ(result.output, "--root\n" + root().string() +
                                 "/\ndiagnose\n--no-logarchive\n\na 'b' \"c\" $d\n\\e\n");
    EXPECT_EQ(result.messages, "");
    EXPECT_EQ(result.status, 7);
    EXPECT_EQ(std::filesystem::status(tool()).permissions(), perms(0755));
}

TEST_F(DeviceDirectoryToolTest, ADeviceThatIsMovedKeepsItsTool) {
    create({});
    const auto moved = place() / "moved";
    std::filesystem::rename(root(), moved);

    const auto result = runProgram({(moved / "usr/bin/mrctl").string(), "status"}, {});

    EXPECT_EQ(result.output, "--root\n" + moved.string() + "/\nstatus\n");
}

TEST_F(DeviceDirectoryToolTest, ADeviceMayHaveNoTool) {
    create({.kind = Kind::missing});

    EXPECT_FALSE(std::filesystem::exists(root() / "usr/bin"));
}

TEST_F(DeviceDirectoryToolTest, WithoutTheProgramThereIsNoRealTool) {
    const auto created = createDeviceDirectory(root(), {});

    ASSERT_TRUE(created) << created.error();
    EXPECT_FALSE(std::filesystem::exists(root() / "usr/bin"));
}

TEST_F(DeviceDirectoryToolTest, AStandInExitsAsItIsToldAndWritesNothing) {
    create({.kind = Kind::standIn, .exitStatus = 42});
    const auto archive = place() / "archive.tar.gz";

    const auto result = run({"diagnose", archive.string()});

    EXPECT_EQ(result.status, 42);
    EXPECT_EQ(result.output + result.messages, "");
    EXPECT_FALSE(std::filesystem::exists(archive));
}

TEST_F(DeviceDirectoryToolTest, AStandInWritesAnArchiveToItsLastArgument) {
    create({.kind = Kind::standIn, .writesArchive = true});
    const auto archive = place() / "-a 'b'.tar.gz";

    const auto result = run({"diagnose", "--no-logarchive", archive.string()});

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output + result.messages, "");
    const auto content = runProgram({"gzip", "-cd"}, {"PATH=/usr/bin:/bin"}, contentOf(archive));
    EXPECT_EQ(content.status, 0) << content.messages;
    EXPECT_EQ(content.output, std::string(1024, '\0'));
}

TEST_F(DeviceDirectoryToolTest, AStandInThatCannotWriteItsArchiveFails) {
    create({.kind = Kind::standIn, .writesArchive = true});

    EXPECT_EQ(run({"diagnose", (place() / "missing/archive.tar.gz").string()}).status, 1);
    EXPECT_EQ(run().status, 1);
}

TEST_F(DeviceDirectoryToolTest, AStandInEndsByItsSignalWhenItHasWritten) {
    const auto archive = place() / "archive.tar.gz";
    create({});
    for (const int signal : {SIGHUP, SIGKILL, SIGSEGV, SIGTERM, SIGXFSZ, SIGRTMIN, SIGRTMAX}) {
        std::filesystem::remove(archive);
        ASSERT_TRUE(change(
            {.kind = Kind::standIn, .writesArchive = true, .signal = signal, .exitStatus = 3}));

        EXPECT_EQ(run({"diagnose", archive.string()}).status, -signal);
        EXPECT_TRUE(std::filesystem::exists(archive)) << signal;
    }
}

TEST_F(DeviceDirectoryToolTest, AChangeReplacesTheTool) {
    create({.kind = Kind::standIn, .exitStatus = 1});

    ASSERT_TRUE(change({.kind = Kind::standIn, .exitStatus = 2}));
    EXPECT_EQ(run().status, 2);
    ASSERT_TRUE(change({.kind = Kind::missing}));
    EXPECT_FALSE(std::filesystem::exists(tool()));
    ASSERT_TRUE(change({.kind = Kind::missing}));
    ASSERT_TRUE(change({}, {.tool = program()}));
    EXPECT_EQ(run().status, 7);
    ASSERT_TRUE(change({}));
    EXPECT_FALSE(std::filesystem::exists(tool()));
}

TEST_F(DeviceDirectoryToolTest, AChangeOfSomethingElseLeavesTheTool) {
    create({.kind = Kind::standIn, .exitStatus = 5});
    GivenDescription given;
    given.keys = {"name"};

    ASSERT_TRUE(changeDeviceDirectory(root(), given, {.tool = program()}));

    EXPECT_EQ(run().status, 5);
}

TEST_F(DeviceDirectoryToolTest, ALinkInTheToolsPlaceIsReplacedAndNotFollowed) {
    create({.kind = Kind::missing});
    const auto target = place() / "target";
    writeTestFile(target, "kept");
    std::filesystem::create_directories(tool().parent_path());
    for (const Kind kind : {Kind::standIn, Kind::missing}) {
        std::filesystem::remove(tool());
        std::filesystem::create_symlink(target, tool());

        ASSERT_TRUE(change({.kind = kind}));

        EXPECT_FALSE(std::filesystem::is_symlink(tool()));
        EXPECT_EQ(contentOf(target), "kept");
    }
}

TEST_F(DeviceDirectoryToolTest, AToolThatCannotBeReplacedIsReported) {
    create({.kind = Kind::missing});
    std::filesystem::create_directories(tool() / "taken");

    const auto written = change({.kind = Kind::standIn});
    const auto removed = change({.kind = Kind::missing});

    ASSERT_FALSE(written);
    ASSERT_FALSE(removed);
    EXPECT_TRUE(
        written.error().description.ends_with("/usr/bin/mrctl: cannot be written: Is a directory"))
        << written.error();
    EXPECT_TRUE(removed.error().description.ends_with(
        "/usr/bin/mrctl: cannot be removed: Directory not empty"))
        << removed.error();
    EXPECT_TRUE(std::filesystem::exists(tool() / "taken"));
}

TEST_F(DeviceDirectoryToolTest, AFileInThePlaceOfItsFolderIsReported) {
    create({.kind = Kind::missing});
    writeTestFile(root() / "usr/bin", "in the way");

    const auto written = change({.kind = Kind::standIn});

    ASSERT_FALSE(written);
    EXPECT_EQ(contentOf(root() / "usr/bin"), "in the way");
}

} // namespace
} // namespace nimbra::device
