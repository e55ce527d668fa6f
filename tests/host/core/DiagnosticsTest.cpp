#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/documents/DeviceFileManager.h"
#include "device/files/Files.h"
#include "device/json/JsonReader.h"
#include "host/core/PaneSession.h"
#include "platform/host/ShareSheet.h"
#include "platform/views/TableCell.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <fcntl.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <map>
#include <memory>
#include <poll.h>
#include <sstream>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace nimbra::host {
namespace {

/// The pane on a real device, with a tool that a test writes.
class Diagnostics : public testing::Test {
protected:
    void openPane(const std::string& more = {}) {
        const auto reader = device::JsonReader::parse(
            R"({"accounts": [{"identifier": "primary", "usesStratafile": true,
                              "enabled": ["kAccountDataclassTidewater"]}],
                "preferences": {"com.vantrel.marrow": {"log.level": 7}},
                "tool": null)" +
                more + '}',
            "description");
        ASSERT_TRUE(reader) << reader.error();
        const auto given = device::readDeviceDescription(*reader);
        ASSERT_FALSE(reader->problem()) << *reader->problem();
        ASSERT_TRUE(device::createDeviceDirectory(root(), given.description));
        auto started = PaneSession::start({.root = root(), .bundle = NIMBRA_PANE_BUNDLE});
        ASSERT_TRUE(started) << started.error();
        session = std::move(*started);
        ASSERT_TRUE(session->openPane({}));
    }

    /// `commands` are those of a shell; the archive's path is "$3" to them.
    void writeTool(const std::string& commands) const {
        const auto tool = root() / "usr/bin/mrctl";
        test::writeTestFile(tool, "#!/bin/sh\n" + commands + '\n');
        std::filesystem::permissions(tool, std::filesystem::perms::all);
    }
    void tap() const {
        const auto tapped = session->tapRow("CLOUD_DRIVE_DIAGNOSE");
        ASSERT_TRUE(tapped) << tapped.error().explanation;
    }
    void collect() const {
        tap();
        session->settle();
    }
    /// What the share sheet offers, as the machine calls it; empty without one.
    [[nodiscard]] std::filesystem::path sharedFile() const {
        const auto& sheet = session->presentations().shareSheet();
        return sheet ? session->device()
                           .fileManager()
                           .fileSystemRepresentation(sheet->activityItems().front())
                           .value_or("")
                     : "";
    }
    [[nodiscard]] std::filesystem::path root() const { return directory.path() / "device"; }
    [[nodiscard]] std::filesystem::path archives() const {
        return root() / "var/mobile/Library/Logs/CrashReporter/DiagnosticLogs/Stratafile";
    }
    [[nodiscard]] std::string note(const std::string& name) const {
        return test::contentOf(directory.path() / name);
    }
    [[nodiscard]] std::string notePath(const std::string& name) const {
        return (directory.path() / name).string();
    }

    test::TemporaryDirectory directory;
    std::unique_ptr<PaneSession> session;
};

TEST_F(Diagnostics, TheArchiveStandsInADirectoryOfItsOwn) {
    openPane();
    writeTool("echo first > \"$3\"");
    collect();
    const auto first = sharedFile();
    EXPECT_EQ(test::contentOf(first), "first\n");
    EXPECT_EQ(first.parent_path(), archives());
    ASSERT_TRUE(session->presentations().endSharing(ShareOutcome::cancelled));
    EXPECT_TRUE(std::filesystem::exists(first));
    test::writeTestFile(archives() / "more/left", "left");

    writeTool("echo second > \"$3\"");
    collect();

    // Only the last one is there, whatever stood there before.
    const auto second = sharedFile();
    EXPECT_EQ(test::treeOf(archives()),
              (std::map<std::string, std::string>{{second.filename(), "second\n"}}));
}

TEST_F(Diagnostics, TheDirectoryIsForEverybody) {
    openPane();
    writeTool(": > \"$3\"");
    const mode_t usual = ::umask(077);

    collect();

    ::umask(usual);
    struct stat found{};
    ASSERT_EQ(::stat(archives().c_str(), &found), 0);
    EXPECT_EQ(found.st_mode & 07777U, 0777U);
}

TEST_F(Diagnostics, ADevicesNameDoesNotLeadOutOfTheDirectory) {
    openPane(R"(, "name": "../../../../../../../../x/..")");
    writeTool("echo here > \"$3\"");

    collect();

    EXPECT_EQ(sharedFile().parent_path(), archives());
    EXPECT_EQ(test::contentOf(sharedFile()), "here\n");
}

TEST_F(Diagnostics, ALinkInThePlaceOfTheDirectoryIsRemovedNotFollowed) {
    openPane();
    writeTool(": > \"$3\"");
    test::writeTestFile(directory.path() / "elsewhere/kept", "kept");
    std::filesystem::create_directories(archives().parent_path());
    std::filesystem::create_symlink(directory.path() / "elsewhere", archives());

    collect();

    EXPECT_EQ(test::contentOf(directory.path() / "elsewhere/kept"), "kept");
    EXPECT_TRUE(std::filesystem::is_directory(std::filesystem::symlink_status(archives())));
    EXPECT_EQ(sharedFile().parent_path(), archives());
}

TEST_F(Diagnostics, TheToolHasNeitherDescriptorsNorAnEnvironment) {
    openPane();
    // One that is not to be closed in a new program.
    const int inherited = ::open("/dev/null", O_RDONLY);
    ASSERT_GT(inherited, 2);
    // The last command takes the shell's place, so that no descriptor of its own is counted.
    writeTool("/usr/bin/env > " + notePath("environment") +
              "\noutputs=$(readlink /proc/$$/fd/1 /proc/$$/fd/2)\necho \"$outputs\" > " +
              notePath("outputs") + "\n: > \"$3\"\nexec ls /proc/self/fd > " +
              notePath("descriptors"));

    collect();

    ::close(inherited);
    EXPECT_FALSE(sharedFile().empty());
    // The fourth is the folder that is listed.
    EXPECT_EQ(note("descriptors"), "0\n1\n2\n3\n");
    EXPECT_EQ(note("outputs"), "/dev/null\n/dev/null\n");
    // What the shell itself sets.
    std::istringstream environment(note("environment"));
    for (std::string line; std::getline(environment, line);) {
        EXPECT_TRUE(line.starts_with("PWD=") || line.starts_with("_=") ||
                    line.starts_with("OLDPWD=") || line.starts_with("SHLVL="))
            << line;
    }
}

TEST_F(Diagnostics, AToolThatFloodsItsOutputIsNotHeldUp) {
    openPane();
    writeTool("dd if=/dev/zero bs=1048576 count=64\ndd if=/dev/zero bs=1048576 count=64 >&2\n"
              ": > \"$3\"");

    collect();

    EXPECT_FALSE(sharedFile().empty());
}

TEST_F(Diagnostics, AToolThatCannotBeRunIsAFailure) {
    openPane();
    writeTool(": > \"$3\"");
    std::filesystem::permissions(root() / "usr/bin/mrctl", std::filesystem::perms::owner_read);

    collect();

    ASSERT_NE(session->presentations().alert(), nullptr);
    EXPECT_EQ(session->presentations().alert()->title, Text("No Diagnostics Collected"));
    EXPECT_TRUE(sharedFile().empty());
}

TEST_F(Diagnostics, ATapWhileTheToolTakesItsTimeDoesNothing) {
    openPane();
    ASSERT_EQ(::mkfifo(notePath("gate").c_str(), 0600), 0);
    writeTool("echo run >> " + notePath("runs") + "\nread -r line < " + notePath("gate") +
              "\n: > \"$3\"");
    tap();
    EXPECT_EQ(session->activity(), Text("Collecting Diagnostics…"));

    tap();
    // Opens when the tool does: it runs now.
    const int gate = ::open(notePath("gate").c_str(), O_WRONLY);
    ASSERT_GE(gate, 0);
    tap();
    session->runPending();
    EXPECT_FALSE(session->activity().string().empty());
    EXPECT_EQ(session->presentations().shareSheet(), nullptr);
    ::close(gate);
    session->settle();

    EXPECT_EQ(note("runs"), "run\n");
    EXPECT_EQ(session->activity(), Text());
    ASSERT_FALSE(sharedFile().empty());
    // Nor while the sheet stands.
    collect();
    EXPECT_EQ(note("runs"), "run\n");
}

TEST_F(Diagnostics, TheSheetPointsToTheRow) {
    openPane();
    writeTool(": > \"$3\"");

    collect();

    const auto cell = std::dynamic_pointer_cast<TableCell>(
        session->presentations().shareSheet()->popoverPresentationController().sourceView);
    ASSERT_NE(cell, nullptr);
    EXPECT_EQ(cell->label(), Text("CLOUD_DRIVE_DIAGNOSE"));
}

TEST_F(Diagnostics, ARowThatIsHiddenMeanwhileIsNotPointedTo) {
    openPane();
    ASSERT_EQ(::mkfifo(notePath("gate").c_str(), 0600), 0);
    writeTool("read -r line < " + notePath("gate") + "\n: > \"$3\"");
    tap();
    const int gate = ::open(notePath("gate").c_str(), O_WRONLY);
    ASSERT_GE(gate, 0);
    ASSERT_TRUE(session->setRow("Nimbra Drive", false));
    // When that has been saved the rows go.
    while (session->row("CLOUD_DRIVE_DIAGNOSE")) {
        pollfd work{.fd = session->loop().wakeUpDescriptor(), .events = POLLIN, .revents = 0};
        ASSERT_EQ(::poll(&work, 1, -1), 1);
        session->runPending();
    }
    ::close(gate);

    session->settle();

    ASSERT_NE(session->presentations().shareSheet(), nullptr);
    EXPECT_EQ(session->presentations().shareSheet()->popoverPresentationController().sourceView,
              nullptr);
}

TEST_F(Diagnostics, AHostDoesNotWaitForATool) {
    openPane();
    ASSERT_EQ(::mkfifo(notePath("gate").c_str(), 0600), 0);
    // It goes neither by itself nor when it is asked to.
    writeTool("trap '' TERM\nread -r line < " + notePath("gate") + "\n: > \"$3\"");
    tap();
    const int gate = ::open(notePath("gate").c_str(), O_WRONLY);
    ASSERT_GE(gate, 0);

    session.reset();

    ::close(gate);
}

TEST_F(Diagnostics, ACollectionThatEndsAfterItsPageShowsNothing) {
    openPane();
    writeTool("exit 1");
    tap();
    session->closePane();
    session->settle();
    EXPECT_EQ(session->presentations().alert(), nullptr);

    ASSERT_TRUE(session->openPane({}));
    writeTool(": > \"$3\"");
    tap();
    session->closePane();
    session->settle();

    EXPECT_EQ(session->presentations().shareSheet(), nullptr);
}

TEST_F(Diagnostics, APageThatClosesTakesItsSheetWithIt) {
    openPane();
    writeTool(": > \"$3\"");
    collect();
    ASSERT_NE(session->presentations().shareSheet(), nullptr);

    session->closePane();
    EXPECT_EQ(session->presentations().shareSheet(), nullptr);

    // A page that is opened anew is not busy with what the other one began.
    ASSERT_TRUE(session->openPane({}));
    collect();
    EXPECT_NE(session->presentations().shareSheet(), nullptr);
}

} // namespace
} // namespace nimbra::host
