#include "device/documents/DeviceFileManager.h"

#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

class DeviceFileManagerTest : public testing::Test {
protected:
    void writeDocuments(const std::string& text) const { test::writeTestFile(path(), text); }
    [[nodiscard]] std::filesystem::path path() const {
        return _directory.path() / "var/lib/nimbra/documents.json";
    }
    [[nodiscard]] DeviceFileManager& fileManager() { return _fileManager; }
    [[nodiscard]] const test::RecordingLog& log() const { return _log; }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    DeviceFileManager _fileManager{DevicePaths(_directory.path()),
                                   DocumentsFile(DevicePaths(_directory.path()), _log)};
};

TEST_F(DeviceFileManagerTest, TheIdentityTokenIsTheOneOfTheFileNow) {
    writeDocuments(R"({"identity": "first"})");
    EXPECT_EQ(fileManager().tidewaterIdentityToken(), Text("first"));

    writeDocuments(R"({"identity": "second"})");
    EXPECT_EQ(fileManager().tidewaterIdentityToken(), Text("second"));

    writeDocuments(R"({"identity": null})");
    EXPECT_EQ(fileManager().tidewaterIdentityToken(), Text());
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceFileManagerTest, TheSystemsRootIsTheDevicesOwn) {
    EXPECT_EQ(fileManager().SystemRootDirectory(), Text("/"));
}

TEST_F(DeviceFileManagerTest, AFileThatCannotBeReadMeansNobodyAndOneLine) {
    writeDocuments(R"({"identity": 7})");

    EXPECT_EQ(fileManager().tidewaterIdentityToken(), Text());

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{
                  "/var/lib/nimbra/documents.json: /identity: expected a string that is "
                  "not empty, or null, found 7"});
}

} // namespace
} // namespace nimbra::device
