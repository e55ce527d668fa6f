#include "host/core/Sharing.h"

#include "device/apps/Process.h"
#include "device/files/Files.h"
#include "tests/device/TestFiles.h"
#include "tests/support/EnvironmentVariable.h"
#include "tests/support/TemporaryDirectory.h"

#include <cerrno>
#include <chrono>
#include <filesystem>
#include <fstream>
#include <gtest/gtest.h>
#include <optional>
#include <string>
#include <sys/stat.h>

namespace nimbra::host {
namespace {

class SharingTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path path(const std::string& name) const {
        return _directory.path() / name;
    }
    /// A mail program that does what `commands` say.
    [[nodiscard]] std::filesystem::path mailProgram(const std::string& commands) const {
        auto program = path("bin/xdg-email");
        test::writeTestFile(program, "#!/bin/sh\n" + commands + '\n');
        std::filesystem::permissions(program, std::filesystem::perms::owner_all);
        return program;
    }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(SharingTest, ACopyIsForItsOwnersEyesOnly) {
    test::writeTestFile(path("archive"), "content");
    std::filesystem::create_directory(path("folder"));

    const auto copy = copyFile(path("archive"), path("folder"));

    ASSERT_TRUE(copy) << copy.error();
    EXPECT_EQ(*copy, path("folder/archive"));
    EXPECT_EQ(device::readFile(*copy), "content");
    EXPECT_EQ(std::filesystem::status(*copy).permissions(),
              std::filesystem::perms::owner_read | std::filesystem::perms::owner_write);
}

TEST_F(SharingTest, ACopyReplacesNothingAndLeavesNothing) {
    test::writeTestFile(path("archive"), "content");
    test::writeTestFile(path("folder/taken"), "mine");

    const auto copy = copyFile(path("archive"), path("folder/taken"));

    ASSERT_FALSE(copy);
    EXPECT_EQ(copy.error(), path("folder/taken").string() + ": is there already");
    EXPECT_EQ(device::readFile(path("folder/taken")), "mine");
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(path("folder")), {}), 1);
}

TEST_F(SharingTest, ACopyThatCannotBeMadeIsNamed) {
    test::writeTestFile(path("archive"), "content");

    EXPECT_EQ(copyFile(path("missing"), path("copy")).error(),
              path("missing").string() + ": No such file or directory");
    EXPECT_EQ(copyFile(path("archive"), path("nowhere/copy")).error(),
              path("nowhere/copy").string() + ": No such file or directory");
    EXPECT_FALSE(std::filesystem::exists(path("copy")));
}

TEST_F(SharingTest, ATildeIsTheUsersOwnFolder) {
    const char* const before = std::getenv("HOME");
    const std::string earlier = before != nullptr ? before : "";
    ::setenv("HOME", "/people/somebody", 1);
    EXPECT_EQ(withHome("~"), "/people/somebody");
    EXPECT_EQ(withHome("~/copies/one"), "/people/somebody/copies/one");
    // Only where it stands for it.
    EXPECT_EQ(withHome("~somebody/copy"), "~somebody/copy");
    EXPECT_EQ(withHome("copies/~"), "copies/~");
    EXPECT_EQ(withHome("/~/copy"), "/~/copy");
    EXPECT_EQ(withHome(""), "");

    ::unsetenv("HOME");
    EXPECT_EQ(withHome("~/copy"), "~/copy");
    ::setenv("HOME", "", 1);
    EXPECT_EQ(withHome("~/copy"), "~/copy");
    ::setenv("HOME", earlier.c_str(), 1);
}

TEST_F(SharingTest, TheMailProgramIsFoundAmongTheUsersPrograms) {
    const auto program = mailProgram("exit 0");
    test::EnvironmentVariable programs("PATH", "/nowhere::" + path("bin").string());
    EXPECT_EQ(findMailProgram(), program);

    // A file that nobody may run is no program.
    std::filesystem::permissions(program, std::filesystem::perms::owner_read);
    EXPECT_EQ(findMailProgram(), std::nullopt);

    programs.set(std::nullopt);
    EXPECT_EQ(findMailProgram(), std::nullopt);
}

TEST_F(SharingTest, BeginningAMailWaitsForNobody) {
    ASSERT_EQ(::mkfifo(path("gate").c_str(), 0600), 0);
    const auto program = mailProgram("read -r line < '" + path("gate").string() +
                                     "'; printf '%s|' \"$@\" > '" + path("mailed").string() + '\'');

    const auto mail = beginMail(program, path("archive"));

    ASSERT_TRUE(mail) << mail.error();
    const auto process = device::Process::withNumber(*mail);
    ASSERT_TRUE(process);
    EXPECT_FALSE(process->awaitEnd(std::chrono::milliseconds(0)));
    std::ofstream(path("gate")) << "go on\n";
    EXPECT_TRUE(awaitMail(program, *mail));
    EXPECT_EQ(device::readFile(path("mailed")), "--attach|" + path("archive").string() + '|');
}

TEST_F(SharingTest, AMailProgramThatFailsIsNamed) {
    const auto program = mailProgram("exit 3");

    const auto mail = beginMail(program, path("archive"));
    ASSERT_TRUE(mail) << mail.error();

    EXPECT_EQ(awaitMail(program, *mail).error(), program.string() + " could not begin a mail");
    EXPECT_EQ(handToMail(program, path("archive")).error(),
              program.string() + " could not begin a mail");
}

TEST_F(SharingTest, AMailProgramThatCannotBeStartedIsNamed) {
    const std::string reason = path("missing").string() + ": No such file or directory";

    EXPECT_EQ(beginMail(path("missing"), path("archive")).error(), reason);
    EXPECT_EQ(handToMail(path("missing"), path("archive")).error(), reason);
}

} // namespace
} // namespace nimbra::host
