#include "device/documents/ProgressFiles.h"

#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

class ProgressFilesTest : public testing::Test {
protected:
    void write(const std::string& name, const std::string& content) const {
        test::writeTestFile(_directory.path() / "run/nimbra/progress" / name, content);
    }
    [[nodiscard]] std::expected<std::vector<ProgressFileContent>, Error> read() const {
        return readProgressFiles(DevicePaths(_directory.path()));
    }
    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }

private:
    test::TemporaryDirectory _directory;
};

TEST_F(ProgressFilesTest, EveryFileOfAProgressIsRead) {
    write("b.json", R"({"fraction": 0.5, "description": "Uploading"})");
    write("a.json", "[]");
    write(".c.json", "{}");
    write("d.txt", "{}");

    const auto files = read();

    ASSERT_TRUE(files) << files.error();
    ASSERT_EQ(files->size(), 2U);
    EXPECT_EQ(files->front().name, "a");
    EXPECT_FALSE(files->front().values);
    EXPECT_EQ(files->back().name, "b");
    ASSERT_TRUE(files->back().values);
    EXPECT_EQ(files->back().values->fraction, 0.5);
    EXPECT_EQ(files->back().values->description, Text("Uploading"));
}

TEST_F(ProgressFilesTest, AFolderThatIsMissingHasNoneAndIsNotMade) {
    const auto files = read();

    ASSERT_TRUE(files) << files.error();
    EXPECT_TRUE(files->empty());
    EXPECT_TRUE(std::filesystem::is_empty(root()));
}

TEST_F(ProgressFilesTest, AFileThatGoesBeforeItIsReadIsNone) {
    write("a.json", "{}");
    write("c.json", "{}");
    const auto folder = root() / "run/nimbra/progress";

    const auto files =
        readListedProgressFiles({folder / "a.json", folder / "b.json", folder / "c.json"});

    ASSERT_EQ(files.size(), 2U);
    EXPECT_EQ(files.front().name, "a");
    EXPECT_EQ(files.back().name, "c");
}

TEST_F(ProgressFilesTest, AFolderThatCannotBeReadIsAnError) {
    test::writeTestFile(root() / "run/nimbra/progress", "no folder");

    EXPECT_FALSE(read());
}

} // namespace
} // namespace nimbra::device
