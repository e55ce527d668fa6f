#include "device/DeviceDirectory.h"
#include "device/documents/DeviceFileManager.h"
#include "device/system/DeviceProcesses.h"
#include "device/system/DeviceWorkQueues.h"
#include "tests/device/Children.h"
#include "tests/device/DevicePlatformFixture.h"
#include "tests/device/TestFiles.h"

#include <cerrno>
#include <csignal>
#include <future>
#include <gtest/gtest.h>
#include <string>
#include <sys/stat.h>
#include <vector>

namespace nimbra::device {
namespace {

class DevicePlatformToolTest : public test::DevicePlatformFixture {
protected:
    [[nodiscard]] std::unique_ptr<DevicePlatform>
    open(const DeviceDescription::Tool& tool = {.kind = DeviceDescription::Tool::Kind::standIn}) {
        DeviceDescription description;
        description.tool = tool;
        const auto made = createDeviceDirectory(root(), description);
        EXPECT_TRUE(made) << made.error();
        return openPlatform();
    }
};

TEST_F(DevicePlatformToolTest, TheToolOfTheDeviceWritesItsArchiveWhereThePageHasMadeRoom) {
    const auto platform = open(
        {.kind = DeviceDescription::Tool::Kind::standIn, .writesArchive = true, .exitStatus = 6});
    const PlatformServices services = platform->servicesFor(host());
    const FileURL archive("/var/mobile/logs/archive.tar.gz");
    ASSERT_TRUE(services.fileManager->createDirectoryAtPathWithIntermediateDirectoriesAttributes(
        "/var/mobile/logs/", true, {.posixPermissions = 0777}));
    std::expected<int, int> status;

    services.workQueues->globalQueueWithQuality(UserInitiatedQuality).sync([&] {
        const auto place = services.fileManager->fileSystemRepresentation(archive);
        const auto process = services.processes->posix_spawn(
            {.path = "/usr/bin/mrctl", .arguments = {"mrctl", "diagnose", place.value()}});
        status = services.processes->waitpid(process.value());
    });

    EXPECT_EQ(status, 6 << 8);
    EXPECT_TRUE(services.fileManager->isResourceReachable(archive));
    EXPECT_TRUE(services.fileManager->removeItemAtPath("/var/mobile/logs"));
    EXPECT_FALSE(std::filesystem::exists(root() / "var/mobile/logs"));
}

TEST_F(DevicePlatformToolTest, TheHostPlansTheFailuresOfThePagesServices) {
    const auto platform = open();
    const PlatformServices services = platform->servicesFor(host());
    platform->fileManager().planRemoveOutcomes({Error{.domain = "D", .code = 1}});
    platform->processes().planSpawnOutcomes({EAGAIN});

    const auto removed = services.fileManager->removeItemAtPath("/usr/bin");
    const auto process = services.processes->posix_spawn({.path = "/usr/bin/mrctl"});

    EXPECT_EQ(removed.error().domain, "D");
    EXPECT_EQ(process, std::unexpected(EAGAIN));
}

TEST_F(DevicePlatformToolTest, AToolThatNeverEndsDoesNotKeepThePlatformFromEnding) {
    auto platform = open();
    const auto pipe = root() / "pipe";
    ASSERT_EQ(::mkfifo(pipe.c_str(), 0600), 0);
    test::writeTestFile(root() / "usr/bin/mrctl",
                        "#!/bin/sh\ntrap '' TERM\necho ready >\"$1\"\nread -r line <\"$1\"\n");
    const PlatformServices services = platform->servicesFor(host());
    std::expected<pid_t, int> process;
    std::expected<int, int> status;
    services.workQueues->globalQueueWithQuality(UserInitiatedQuality).async([&] {
        process = services.processes->posix_spawn(
            {.path = "/usr/bin/mrctl", .arguments = {"mrctl", pipe.string()}});
        status = services.processes->waitpid(process.value());
    });
    EXPECT_EQ(test::contentOf(pipe), "ready\n");

    platform.reset();

    EXPECT_EQ(status, std::unexpected(ECANCELED));
    EXPECT_EQ(::kill(process.value(), SIGKILL), 0);
    test::awaitNothingLeft(process.value());
}

} // namespace
} // namespace nimbra::device
