#include "tests/device/TestFiles.h"
#include "tests/tools/mrctl/Diagnosis.h"
#include "tools/mrctl/TemporaryFile.h"

#include <algorithm>
#include <array>
#include <csignal>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <limits.h>
#include <random>
#include <sys/file.h>
#include <sys/inotify.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

namespace nimbra::test {
namespace {

using Names = std::vector<std::string>;

/// Called like what a run that was killed leaves.
constexpr auto leftover = ".mrctl-0123456789abcdef";

// Runs a command whose files can grow to so many kilobytes. What it says goes through a pipe: a
// file could not grow. The signal of a file that may not is ignored by the program itself; what a
// sanitizer writes before that would end it.
constexpr const char* onFullDisk =
    "set -o pipefail; trap '' XFSZ; (ulimit -f \"$0\"; exec \"$@\" 2>&1) | cat";

class ArchiveWritingTest : public testing::Test {
protected:
    ArchiveWritingTest() { _diagnosis.make({}); }

    [[nodiscard]] const Diagnosis& diagnosis() const { return _diagnosis; }

    [[nodiscard]] ProgramResult diagnose() const {
        return _diagnosis.run({"diagnose", _diagnosis.archive().string()});
    }

    /// Gives the device so many numbers to tell of, about four bytes each in an archive.
    void makeLarge(int numbers) const {
        std::mt19937 random(1); // NOLINT(cert-msc51-cpp): the same device each time
        std::string values = "{\"a\": [0";
        for (int count = 0; count < numbers; ++count) {
            values += ',' + std::to_string(random());
        }
        _diagnosis.write("/var/lib/nimbra/preferences/com.example.large.json", values + "]}");
    }

    /// Expects a failure in one line that names the archive, and nothing left.
    void expectFailure(const ProgramResult& result, const std::string& message,
                       const Names& left = {}) const {
        EXPECT_EQ(result.status, 1);
        EXPECT_EQ(result.output + result.messages, "mrctl: " + _diagnosis.archive().string() +
                                                       ": cannot be written: " + message + '\n');
        EXPECT_EQ(_diagnosis.namesInPlace(), left);
    }

private:
    Diagnosis _diagnosis;
};

TEST_F(ArchiveWritingTest, TheArchiveHasThePermissionsOfANewFile) {
    for (const auto& [mask, permissions] :
         std::vector<std::pair<mode_t, mode_t>>{{022, 0644}, {077, 0600}, {0, 0666}, {027, 0640}}) {
        const mode_t earlier = ::umask(mask);
        const ProgramResult result = diagnose();
        ::umask(earlier);

        ASSERT_EQ(result.status, 0);
        struct stat status{};
        ASSERT_EQ(::stat(diagnosis().archive().c_str(), &status), 0);
        EXPECT_EQ(status.st_mode & 07777U, permissions);
        EXPECT_EQ(diagnosis().namesInPlace(), Names{"fault.tar.gz"});
    }
}

TEST_F(ArchiveWritingTest, AnEarlierArchiveIsReplaced) {
    writeTestFile(diagnosis().archive(), "earlier");

    ASSERT_EQ(diagnose().status, 0);

    EXPECT_TRUE(entriesOf(diagnosis().archive()).contains("fault/MANIFEST"));
}

TEST_F(ArchiveWritingTest, ARelativePathIsOneOfTheWorkingDirectory) {
    const ProgramResult result =
        runProgram({"sh", "-c", "cd \"$2\" && exec \"$0\" --root \"$1\" diagnose here.tar.gz",
                    NIMBRA_MRCTL, diagnosis().root().string(), diagnosis().place().string()},
                   {"PATH=/usr/bin:/bin"});

    EXPECT_EQ(result.status, 0) << result.messages;
    EXPECT_TRUE(entriesOf(diagnosis().place() / "here.tar.gz").contains("here/MANIFEST"));
}

TEST_F(ArchiveWritingTest, ItWorksWithoutEnvironmentAndStandardInput) {
    const int nowhere = ::open("/dev/null", O_RDWR | O_CLOEXEC);
    for (const std::array<int, 3>& files :
         {std::array{-1, nowhere, nowhere}, std::array{-1, -1, -1}}) {
        std::filesystem::remove(diagnosis().archive());
        const pid_t process = startProgram({NIMBRA_MRCTL, "--root", diagnosis().root().string(),
                                            "diagnose", diagnosis().archive().string()},
                                           {}, files);
        int status = 0;
        ASSERT_EQ(::waitpid(process, &status, 0), process);
        EXPECT_EQ(exitStatusOf(status), 0);
        EXPECT_TRUE(entriesOf(diagnosis().archive()).contains("fault/MANIFEST"));
    }
    ::close(nowhere);
}

TEST_F(ArchiveWritingTest, AFullDiskLeavesNothing) {
    makeLarge(30'000);
    for (const std::string kilobytes : {"0", "1", "16", "100"}) {
        const ProgramResult result =
            runProgram({"bash", "-c", onFullDisk, kilobytes, NIMBRA_MRCTL, "--root",
                        diagnosis().root().string(), "diagnose", diagnosis().archive().string()},
                       {"PATH=/usr/bin:/bin"});
        expectFailure(result, "File too large");
    }
}

TEST_F(ArchiveWritingTest, AFullDiskLeavesAnEarlierArchive) {
    writeTestFile(diagnosis().archive(), "earlier");

    const ProgramResult result =
        runProgram({"bash", "-c", onFullDisk, "0", NIMBRA_MRCTL, "--root",
                    diagnosis().root().string(), "diagnose", diagnosis().archive().string()},
                   {"PATH=/usr/bin:/bin"});

    expectFailure(result, "File too large", {"fault.tar.gz"});
    EXPECT_EQ(contentOf(diagnosis().archive()), "earlier");
}

TEST_F(ArchiveWritingTest, ADirectoryThatIsMissingIsAFailure) {
    std::filesystem::remove(diagnosis().place());
    const ProgramResult result = diagnose();

    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.messages, "mrctl: " + diagnosis().archive().string() +
                                   ": cannot be written: No such file or directory\n");
    EXPECT_FALSE(std::filesystem::exists(diagnosis().place()));
}

TEST_F(ArchiveWritingTest, APathThatIsADirectoryIsAFailure) {
    std::filesystem::create_directory(diagnosis().archive());
    expectFailure(diagnose(), "Is a directory", {"fault.tar.gz"});

    const ProgramResult result = diagnosis().run({"diagnose", diagnosis().place().string() + '/'});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(diagnosis().namesInPlace(), Names{"fault.tar.gz"});
}

TEST_F(ArchiveWritingTest, APathThatIsNoPlainFileIsAFailureAndStays) {
    const auto target = diagnosis().root() / "target";
    writeTestFile(target, "kept");
    const auto expectRefusal = [this] {
        const auto before = std::filesystem::symlink_status(diagnosis().archive()).type();
        expectFailure(diagnose(), "is not a plain file", {"fault.tar.gz"});
        EXPECT_EQ(std::filesystem::symlink_status(diagnosis().archive()).type(), before);
        std::filesystem::remove(diagnosis().archive());
    };

    ASSERT_EQ(::mkfifo(diagnosis().archive().c_str(), 0644), 0);
    expectRefusal();
    for (const auto& linked : {target, diagnosis().root(), std::filesystem::path("/dev/null"),
                               std::filesystem::path("missing")}) {
        std::filesystem::create_symlink(linked, diagnosis().archive());
        expectRefusal();
    }
    EXPECT_EQ(contentOf(target), "kept");
}

TEST_F(ArchiveWritingTest, WhatTakesThePlaceMeanwhileStays) {
    auto file = mrctl::TemporaryFile::make(diagnosis().archive(), ".mrctl-");
    ASSERT_TRUE(file) << file.error();
    std::filesystem::create_symlink("elsewhere", diagnosis().archive());

    const auto put = file->putInPlace();

    ASSERT_FALSE(put);
    EXPECT_TRUE(put.error().description.ends_with("is not a plain file")) << put.error();
    EXPECT_TRUE(std::filesystem::is_symlink(diagnosis().archive()));
}

TEST_F(ArchiveWritingTest, NobodyElseReadsTheArchiveWhileItIsWritten) {
    const mode_t earlier = ::umask(0);
    const auto file = mrctl::TemporaryFile::make(diagnosis().archive(), ".mrctl-");
    ::umask(earlier);
    ASSERT_TRUE(file) << file.error();

    struct stat status{};
    ASSERT_EQ(::fstat(file->descriptor(), &status), 0);
    EXPECT_EQ(status.st_mode & 07777U, 0600U);
}

TEST_F(ArchiveWritingTest, LeftoversGoWithTheNextRun) {
    writeTestFile(diagnosis().place() / leftover, "half an archive");
    const Names others{".mrctl-",
                       ".mrctl-0123456789abcde",
                       ".mrctl-0123456789abcdeF",
                       ".mrctl-0123456789abcdef0",
                       ".mrctl-123",
                       ".mrctl-notes.txt",
                       ".other"};
    for (const std::string& name : others) {
        writeTestFile(diagnosis().place() / name, "not its own");
    }

    ASSERT_EQ(diagnose().status, 0);

    Names left = others;
    left.emplace_back("fault.tar.gz");
    EXPECT_EQ(diagnosis().namesInPlace(), left);
}

TEST_F(ArchiveWritingTest, WhatAnotherRunIsWritingStays) {
    const auto other = diagnosis().place() / leftover;
    writeTestFile(other, "half an archive");
    const int file = ::open(other.c_str(), O_RDONLY | O_CLOEXEC);
    ASSERT_EQ(::flock(file, LOCK_EX), 0);

    ASSERT_EQ(diagnose().status, 0);

    EXPECT_EQ(diagnosis().namesInPlace(), (Names{leftover, "fault.tar.gz"}));
    ::close(file);
}

TEST_F(ArchiveWritingTest, LinksCalledLikeALeftoverAreNotFollowed) {
    const auto target = diagnosis().root() / "kept";
    writeTestFile(target, "kept");
    std::filesystem::create_symlink(target, diagnosis().place() / leftover);

    ASSERT_EQ(diagnose().status, 0);

    EXPECT_EQ(contentOf(target), "kept");
}

/// Waits until something has happened in a directory a number of times.
class Happenings {
public:
    explicit Happenings(const std::filesystem::path& directory)
        : _watch(::inotify_init1(IN_CLOEXEC)) {
        EXPECT_GE(
            ::inotify_add_watch(_watch, directory.c_str(), IN_CREATE | IN_MODIFY | IN_MOVED_TO), 0);
    }
    Happenings(const Happenings&) = delete;
    Happenings& operator=(const Happenings&) = delete;
    ~Happenings() { ::close(_watch); }

    void await() const {
        std::array<char, sizeof(inotify_event) + NAME_MAX + 1> event{};
        EXPECT_GT(::read(_watch, event.data(), event.size()), 0);
    }

private:
    int _watch;
};

TEST_F(ArchiveWritingTest, AKilledRunLeavesNoHalfArchive) {
    makeLarge(40'000);
    bool hasLeftSomething = false;
    for (int happenings = 1; happenings <= 6; ++happenings) {
        std::filesystem::remove(diagnosis().archive());
        const Happenings place(diagnosis().place());
        const int nowhere = ::open("/dev/null", O_RDWR | O_CLOEXEC);
        const pid_t process = startProgram({NIMBRA_MRCTL, "--root", diagnosis().root().string(),
                                            "diagnose", diagnosis().archive().string()},
                                           {}, {nowhere, nowhere, nowhere});
        ::close(nowhere);
        // The file that the earlier round has left goes without being told of here; the first
        // thing to happen is that this round's comes, then it grows.
        for (int count = 0; count < happenings; ++count) {
            place.await();
        }
        ::kill(process, SIGKILL);
        ASSERT_EQ(::waitpid(process, nullptr, 0), process);

        hasLeftSomething = hasLeftSomething || !diagnosis().namesInPlace().empty();
        for (const std::string& name : diagnosis().namesInPlace()) {
            EXPECT_TRUE(name.starts_with(".mrctl-") ||
                        entriesOf(diagnosis().archive()).contains("fault/problems.txt"))
                << name;
        }
    }
    EXPECT_TRUE(hasLeftSomething);

    ASSERT_EQ(diagnose().status, 0);
    EXPECT_EQ(diagnosis().namesInPlace(), Names{"fault.tar.gz"});
}

TEST_F(ArchiveWritingTest, ADirectoryForReadingOnlyIsAFailure) {
    std::filesystem::permissions(diagnosis().place(), std::filesystem::perms(0555));
    std::vector<std::string> command{NIMBRA_MRCTL, "--root", diagnosis().root().string(),
                                     "diagnose", diagnosis().archive().string()};
    if (::geteuid() == 0) {
        // Without the right to write everywhere.
        command.insert(command.begin(), {"setpriv", "--bounding-set=-dac_override"});
    }

    const ProgramResult result = runProgram(command, {"PATH=/usr/bin:/bin"});

    expectFailure(result, "Permission denied");
}

} // namespace
} // namespace nimbra::test
