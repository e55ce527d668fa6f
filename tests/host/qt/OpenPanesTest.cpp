#include "host/qt/OpenPanes.h"

#include "tests/device/FullDisk.h"
#include "tests/device/ReadOnly.h"
#include "tests/device/TestFiles.h"
#include "tests/support/ProgramRun.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <array>
#include <atomic>
#include <barrier>
#include <chrono>
#include <csignal>
#include <fcntl.h>
#include <filesystem>
#include <gtest/gtest.h>
#include <iterator>
#include <stop_token>
#include <string>
#include <sys/prctl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>
#include <utility>
#include <vector>

namespace nimbra::window {

namespace {

namespace files = std::filesystem;

/// A host in a process of its own, with a pane open.
class OtherHost {
public:
    OtherHost(const files::path& folder, const files::path& root, const std::string& title) {
        std::array<int, 2> ends{};
        EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0);
        _process = ::fork();
        if (_process == 0) {
            // It does not outlive a test that is killed.
            ::prctl(PR_SET_PDEATHSIG, SIGKILL);
            OpenPanes panes(folder);
            const char word = panes.opened(root, title) ? 'y' : 'n';
            static_cast<void>(::write(ends[1], &word, 1) == 1);
            while (true) {
                ::pause();
            }
        }
        ::close(ends[1]);
        char word = '\0';
        EXPECT_EQ(::read(ends[0], &word, 1), 1);
        EXPECT_EQ(word, 'y');
        ::close(ends[0]);
    }
    OtherHost(const OtherHost&) = delete;
    OtherHost& operator=(const OtherHost&) = delete;
    ~OtherHost() { kill(); }

    void kill() {
        if (const pid_t process = std::exchange(_process, -1); process > 0) {
            EXPECT_EQ(::kill(process, SIGKILL), 0);
            int status = 0;
            EXPECT_EQ(::waitpid(process, &status, 0), process);
            EXPECT_EQ(test::exitStatusOf(status), -SIGKILL);
        }
    }

private:
    pid_t _process = -1;
};

class OpenPanesTest : public testing::Test {
protected:
    OpenPanesTest() { files::create_directory(root()); }

    [[nodiscard]] files::path state() const { return _directory.path() / "state"; }
    [[nodiscard]] files::path folder() const { return state() / "settingshost"; }
    [[nodiscard]] files::path root() const { return _directory.path() / "device"; }
    [[nodiscard]] std::ptrdiff_t fileCount() const {
        return std::distance(files::directory_iterator(folder()), files::directory_iterator());
    }
    void dieWithAPane(const std::string& title) const { OtherHost(folder(), root(), title).kill(); }
    void dieWithAPaneOf(const files::path& device) const {
        OtherHost(folder(), device, "Other").kill();
    }
    /// The title that is told of; empty where no host died.
    [[nodiscard]] std::string tellOfDied() const {
        const auto findings = OpenPanes(folder()).takeDied(root());
        EXPECT_FALSE(findings.problem) << *findings.problem;
        return findings.died ? findings.died->paneTitle : "";
    }

    test::TemporaryDirectory _directory;
};

} // namespace

TEST_F(OpenPanesTest, AHostThatDiedWithItsPaneOpenIsToldOfOnce) {
    // Given a host that was killed
    dieWithAPane("Nimbra Drive");

    // When two others start after it, then the first is told and nothing is left
    EXPECT_EQ(tellOfDied(), "Nimbra Drive");
    EXPECT_EQ(fileCount(), 0);
    EXPECT_EQ(tellOfDied(), "");
}

TEST_F(OpenPanesTest, NothingIsToldBeforeThereWasAHost) {
    EXPECT_EQ(tellOfDied(), "");
    EXPECT_FALSE(files::exists(state()));
}

TEST_F(OpenPanesTest, AHostThatLivesIsLeftInPeace) {
    // Given a host with its pane open
    OtherHost living(folder(), root(), "Nimbra Drive");

    // When another one looks, opens and closes a pane of its own
    EXPECT_EQ(tellOfDied(), "");
    {
        OpenPanes panes(folder());
        ASSERT_TRUE(panes.opened(root(), "Mine"));
        EXPECT_EQ(fileCount(), 2);
        EXPECT_EQ(tellOfDied(), "");
    }
    EXPECT_EQ(fileCount(), 1);

    // Then the first is told of when it dies
    living.kill();
    EXPECT_EQ(tellOfDied(), "Nimbra Drive");
}

TEST_F(OpenPanesTest, APaneThatIsClosedInOrderIsNotToldOf) {
    OpenPanes panes(folder());
    ASSERT_TRUE(panes.opened(root(), "Nimbra Drive"));
    EXPECT_EQ(fileCount(), 1);
    EXPECT_TRUE(panes.closed());
    EXPECT_EQ(fileCount(), 0);
    EXPECT_TRUE(panes.closed());
    EXPECT_EQ(tellOfDied(), "");
}

TEST_F(OpenPanesTest, OneHostHasOneFile) {
    OpenPanes panes(folder());
    ASSERT_TRUE(panes.opened(root(), "First"));
    ASSERT_TRUE(panes.opened(root(), "Second"));
    EXPECT_EQ(fileCount(), 1);
}

TEST_F(OpenPanesTest, NobodyElseCanReadWhatIsNoted) {
    OpenPanes panes(folder());
    ASSERT_TRUE(panes.opened(root(), "Nimbra Drive"));
    EXPECT_EQ(files::status(folder()).permissions(), files::perms::owner_all);
    EXPECT_EQ(files::directory_iterator(folder())->status().permissions(),
              files::perms::owner_read | files::perms::owner_write);
}

TEST_F(OpenPanesTest, HostsThatStartTogetherShareOutWhatIsLeft) {
    constexpr int rounds = 2000;
    constexpr int hostCount = 3;
    const std::string left = root().string() + '\0' + "Nimbra Drive" + '\0';
    std::atomic<int> told = 0;
    // All set out on a file at once, and again when it has been told of.
    std::barrier together(hostCount, [&, isStart = true]() mutable noexcept {
        if (isStart) {
            EXPECT_EQ(told.exchange(0), 1);
            test::writeTestFile(folder() / "pane-1", left);
        }
        isStart = !isStart;
    });
    told = 1;
    std::vector<std::jthread> hosts;
    for (int host = 0; host < hostCount; ++host) {
        hosts.emplace_back([&] {
            for (int round = 0; round < rounds; ++round) {
                together.arrive_and_wait();
                told += OpenPanes(folder()).takeDied(root()).died ? 1 : 0;
                together.arrive_and_wait();
            }
        });
    }
    hosts.clear();
    EXPECT_EQ(told, 1);
}

TEST_F(OpenPanesTest, AHostThatStartsDoesNotClearAwayAFileThatIsBeingMade) {
    OpenPanes panes(folder());
    const std::jthread starting([&](const std::stop_token& end) {
        while (!end.stop_requested()) {
            EXPECT_FALSE(OpenPanes(folder()).takeDied(root()).died);
        }
    });
    constexpr int rounds = 500;
    for (int round = 0; round < rounds; ++round) {
        ASSERT_TRUE(panes.opened(root(), "Nimbra Drive"));
        ASSERT_TRUE(std::ranges::any_of(files::directory_iterator(folder()),
                                        [](const auto& entry) { return entry.file_size() > 0; }));
        ASSERT_TRUE(panes.closed());
    }
}

TEST_F(OpenPanesTest, OfSeveralTheLastIsToldOf) {
    dieWithAPane("First");
    // The file system's clock may not have moved.
    files::last_write_time(files::directory_iterator(folder())->path(),
                           files::file_time_type::min() + std::chrono::hours(1));
    dieWithAPane("Second");
    EXPECT_EQ(tellOfDied(), "Second");
    EXPECT_EQ(fileCount(), 0);
}

TEST_F(OpenPanesTest, HostsOfOtherDevicesAreLeftForThem) {
    const files::path other = _directory.path() / "other";
    files::create_directory(other);
    dieWithAPaneOf(other);
    EXPECT_EQ(tellOfDied(), "");
    EXPECT_EQ(fileCount(), 1);
    EXPECT_TRUE(OpenPanes(folder()).takeDied(other).died);
}

TEST_F(OpenPanesTest, ADeviceIsTheSameHoweverItIsWritten) {
    const files::path link = _directory.path() / "link";
    files::create_directory_symlink(root(), link);
    for (const files::path& written :
         {link, link / "", root() / "", root() / "../device/.", files::relative(root())}) {
        dieWithAPaneOf(written);
        EXPECT_EQ(tellOfDied(), "Other") << written;
    }
}

TEST_F(OpenPanesTest, TitlesAndPathsMayHoldAnyBytes) {
    const files::path odd = _directory.path() / "a\nb \xff\"";
    files::create_directory(odd);
    const std::string title("Nimbra\nDrive\0 \xfe", 15);
    OtherHost(folder(), odd, title).kill();
    const auto findings = OpenPanes(folder()).takeDied(odd);
    ASSERT_TRUE(findings.died);
    EXPECT_EQ(findings.died->paneTitle, title);
}

TEST_F(OpenPanesTest, ATitleWithoutEndIsRefused) {
    OpenPanes panes(folder());
    EXPECT_FALSE(panes.opened(root(), std::string(1'000'000, 'x')));
    EXPECT_FALSE(files::exists(folder()));
}

TEST_F(OpenPanesTest, AFileWithoutItsEndIsClearedAway) {
    // A host died after it had made its file, and before the pane opened.
    test::writeTestFile(folder() / "pane-1", "");
    test::writeTestFile(folder() / "pane-2", root().string());
    test::writeTestFile(folder() / "pane-3", root().string() + '\0');
    test::writeTestFile(folder() / "pane-4", root().string() + '\0' + "Nimb");
    EXPECT_EQ(tellOfDied(), "");
    EXPECT_EQ(fileCount(), 0);
}

TEST_F(OpenPanesTest, WhatNoHostHasMadeStays) {
    // Given what looks like a host's file and is none, and a file that it must not lead to
    const std::string left = root().string() + '\0' + "Nimbra Drive" + '\0';
    test::writeTestFile(_directory.path() / "elsewhere", left);
    test::writeTestFile(folder() / "notes", left);
    files::create_symlink(_directory.path() / "elsewhere", folder() / "pane-link");
    files::create_directory(folder() / "pane-folder");
    ASSERT_EQ(::mkfifo((folder() / "pane-fifo").c_str(), 0600), 0);

    // When a host starts, then it does not wait, and leaves everything
    EXPECT_EQ(tellOfDied(), "");
    EXPECT_EQ(fileCount(), 4);
    EXPECT_EQ(test::contentOf(_directory.path() / "elsewhere"), left);
}

TEST_F(OpenPanesTest, AFolderBehindALinkIsNotUsed) {
    const files::path elsewhere = _directory.path() / "elsewhere";
    files::create_directory(elsewhere);
    files::create_directory(state());
    files::create_directory_symlink(elsewhere, folder());

    OpenPanes panes(folder());
    EXPECT_TRUE(panes.takeDied(root()).problem);
    EXPECT_FALSE(panes.opened(root(), "Nimbra Drive"));
    EXPECT_TRUE(files::is_empty(elsewhere));
}

TEST_F(OpenPanesTest, APipeInPlaceOfTheFolderIsNotWaitedFor) {
    files::create_directory(state());
    ASSERT_EQ(::mkfifo(folder().c_str(), 0600), 0);

    OpenPanes panes(folder());
    const auto findings = panes.takeDied(root());
    ASSERT_TRUE(findings.problem);
    EXPECT_TRUE(findings.problem->description.starts_with(folder().string()));
    EXPECT_FALSE(panes.opened(root(), "Nimbra Drive"));
}

TEST_F(OpenPanesTest, AFolderThatCannotBeReadIsAProblem) {
    files::create_directories(folder());
    files::permissions(folder(), files::perms::none);
    files::permissions(_directory.path(), files::perms::all);
    const uid_t earlier = ::geteuid();
    if (earlier == 0) {
        ASSERT_EQ(::seteuid(65534), 0);
    }
    OpenPanes panes(folder());
    const auto findings = panes.takeDied(root());
    const auto opened = panes.opened(root(), "Nimbra Drive");
    ASSERT_EQ(::seteuid(earlier), 0);
    EXPECT_FALSE(findings.died);
    EXPECT_TRUE(findings.problem);
    EXPECT_FALSE(opened);
}

TEST_F(OpenPanesTest, APaneThatCannotBeNotedIsNoHindrance) {
    // Given a folder in which nothing can be made
    files::create_directories(folder());
    OpenPanes panes(folder());
    {
        const test::ReadOnly readOnly(folder());
        EXPECT_FALSE(panes.opened(root(), "Nimbra Drive"));
        EXPECT_TRUE(panes.closed());
    }
    // Then the next pane is noted
    EXPECT_TRUE(panes.opened(root(), "Nimbra Drive"));
    EXPECT_EQ(fileCount(), 1);
}

TEST_F(OpenPanesTest, AFullDiskLeavesNothingHalfWritten) {
    OpenPanes panes(folder());
    {
        const test::FullDisk full;
        EXPECT_FALSE(panes.opened(root(), "Nimbra Drive"));
    }
    EXPECT_EQ(fileCount(), 0);
    EXPECT_TRUE(panes.closed());
}

TEST_F(OpenPanesTest, APaneClosesInOrderWhereNothingCanBeRemoved) {
    // Given a pane that is open when its folder becomes read-only
    OpenPanes panes(folder());
    ASSERT_TRUE(panes.opened(root(), "Nimbra Drive"));
    {
        const test::ReadOnly readOnly(folder());
        EXPECT_TRUE(panes.closed());
    }
    // Then its file is left, and says nothing
    EXPECT_EQ(fileCount(), 1);
    EXPECT_EQ(tellOfDied(), "");
    EXPECT_EQ(fileCount(), 0);
}

TEST_F(OpenPanesTest, AHostThatDiedIsToldOfAlsoWhereItsFileCannotBeRemoved) {
    dieWithAPane("Nimbra Drive");
    files::permissions(_directory.path(), files::perms::all);
    const test::ReadOnly readOnly(folder());
    const auto findings = OpenPanes(folder()).takeDied(root());
    ASSERT_TRUE(findings.died);
    EXPECT_EQ(findings.died->paneTitle, "Nimbra Drive");
    EXPECT_TRUE(findings.problem);
}

TEST_F(OpenPanesTest, AFileThatCannotBeReadDoesNotHideTheOthers) {
    dieWithAPane("Nimbra Drive");
    test::writeTestFile(folder() / "pane-0", "");
    files::permissions(folder(), files::perms::all);
    files::permissions(_directory.path(), files::perms::all);
    for (const auto& entry : files::directory_iterator(folder())) {
        files::permissions(entry.path(), entry.path().filename() == "pane-0" ? files::perms::none
                                                                             : files::perms::all);
    }
    const uid_t earlier = ::geteuid();
    if (earlier == 0) {
        ASSERT_EQ(::seteuid(65534), 0);
    }
    const auto findings = OpenPanes(folder()).takeDied(root());
    ASSERT_EQ(::seteuid(earlier), 0);
    EXPECT_TRUE(findings.died);
    ASSERT_TRUE(findings.problem);
    EXPECT_NE(findings.problem->description.find("pane-0"), std::string::npos);
}

} // namespace nimbra::window
