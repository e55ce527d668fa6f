#include "device/documents/DeviceDocumentContainers.h"

#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>
#include <optional>
#include <unistd.h>

namespace nimbra::device {
namespace {

class DeviceDocumentContainersTest : public testing::Test {
protected:
    DeviceDocumentContainersTest() { _containers.emplace(DevicePaths(root()), _queue, _log); }

    [[nodiscard]] const std::filesystem::path& root() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path documents() const {
        return root() / "var/lib/nimbra/documents.json";
    }
    [[nodiscard]] std::filesystem::path hints() const {
        return root() / "run/nimbra/priority-hints" / std::to_string(::getpid());
    }
    [[nodiscard]] static std::string hintsOnDevice() {
        return "/run/nimbra/priority-hints/" + std::to_string(::getpid());
    }
    void writeDocuments(const std::string& containers) const {
        test::writeTestFile(documents(),
                            R"({"identity": "token", "containers": )" + containers + "}");
    }

    [[nodiscard]] DeviceDocumentContainers& containers() { return *_containers; }
    void endContainers() { _containers.reset(); }
    [[nodiscard]] test::PumpedQueue& queue() { return *_queue; }
    [[nodiscard]] const test::RecordingLog& log() const { return _log; }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    std::shared_ptr<test::PumpedQueue> _queue =
        std::make_shared<test::PumpedQueue>("document-refresh");
    std::optional<DeviceDocumentContainers> _containers;
};

TEST_F(DeviceDocumentContainersTest, TheContainersAreThoseOfTheFileNow) {
    writeDocuments(R"([{"identifier": "a", "public": true}, {"identifier": "b"}])");
    const auto first = containers().allContainers();
    writeDocuments(R"([{"identifier": "c", "public": true}])");
    const auto second = containers().allContainers();

    ASSERT_EQ(first.size(), 2U);
    EXPECT_TRUE(first[0]->isDocumentScopePublic());
    EXPECT_FALSE(first[1]->isDocumentScopePublic());
    ASSERT_EQ(second.size(), 1U);
    EXPECT_TRUE(second[0]->isDocumentScopePublic());
}

TEST_F(DeviceDocumentContainersTest, WithoutAnIdentityThereAreNoContainers) {
    test::writeTestFile(documents(), R"({"containers": [{"identifier": "a"}]})");

    EXPECT_TRUE(containers().allContainers().empty());
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceDocumentContainersTest, AFileThatCannotBeReadMeansNoContainersAndOneLine) {
    EXPECT_TRUE(containers().allContainers().empty());

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{
                  "/var/lib/nimbra/documents.json: cannot be read: No such file or directory"});
}

TEST_F(DeviceDocumentContainersTest, RegisteringLeavesAHintAndUnregisteringTakesAllBack) {
    writeDocuments(R"([{"identifier": "com.example.notes"}, {"identifier": "../odd name"}])");
    for (const auto& container : containers().allContainers()) {
        EXPECT_TRUE(container->registerCurrentProcessAsPriorityHintWithError());
        EXPECT_TRUE(container->registerCurrentProcessAsPriorityHintWithError());
    }
    EXPECT_EQ(test::treeOf(hints()), (std::map<std::string, std::string>{
                                         {"com.example.notes", ""}, {"%2E.%2Fodd%20name", ""}}));

    containers().unregisterCurrentProcessAsPriorityHint();

    EXPECT_FALSE(std::filesystem::exists(hints()));
    containers().unregisterCurrentProcessAsPriorityHint();
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceDocumentContainersTest, TheHintsEndWithTheProcessesContainers) {
    writeDocuments(R"([{"identifier": "a"}])");
    ASSERT_TRUE(
        containers().allContainers().front()->registerCurrentProcessAsPriorityHintWithError());

    endContainers();

    EXPECT_FALSE(std::filesystem::exists(hints()));
}

TEST_F(DeviceDocumentContainersTest, AContainerMayRefuseTheHint) {
    writeDocuments(R"([{"identifier": "a", "registrationFails": true}])");

    const auto registered =
        containers().allContainers().front()->registerCurrentProcessAsPriorityHintWithError();

    ASSERT_FALSE(registered);
    EXPECT_EQ(registered.error().description, "a: the daemon refuses the priority hint");
    EXPECT_FALSE(std::filesystem::exists(hints()));
}

TEST_F(DeviceDocumentContainersTest, AHintThatCannotBeLeftIsAnError) {
    writeDocuments(R"([{"identifier": "a"}])");
    test::writeTestFile(root() / "run/nimbra", "in the way");
    const auto container = containers().allContainers().front();

    const auto registered = container->registerCurrentProcessAsPriorityHintWithError();

    ASSERT_FALSE(registered);
    EXPECT_EQ(registered.error().description,
              hintsOnDevice() + ": cannot be made: Not a directory");
}

TEST_F(DeviceDocumentContainersTest, AHintWhoseFileCannotBeMadeIsAnError) {
    const std::string longName(300, 'x');
    writeDocuments(R"([{"identifier": ")" + longName + R"("}])");
    const auto container = containers().allContainers().front();

    const auto registered = container->registerCurrentProcessAsPriorityHintWithError();

    ASSERT_FALSE(registered);
    EXPECT_EQ(registered.error().description,
              hintsOnDevice() + '/' + longName + ": cannot be made: File name too long");
}

TEST_F(DeviceDocumentContainersTest, HintsThatCannotBeTakenBackAreReported) {
    std::filesystem::create_directories(root() / "run");
    std::filesystem::create_symlink("nimbra", root() / "run/nimbra");

    containers().unregisterCurrentProcessAsPriorityHint();

    EXPECT_EQ(log().lines(),
              std::vector<std::string>{
                  "/run/nimbra: cannot be followed: Too many levels of symbolic links"});
}

TEST_F(DeviceDocumentContainersTest, ARefreshLooksAndThenTellsOnItsQueue) {
    writeDocuments("[]");
    int completions = 0;

    containers().forceRefreshAllContainersWithCompletion([&completions] { ++completions; });

    EXPECT_EQ(completions, 0);
    queue().pump();
    EXPECT_EQ(completions, 1);
    EXPECT_TRUE(log().lines().empty());
}

TEST_F(DeviceDocumentContainersTest, ARefreshThatFailsTellsTheLogAndCompletes) {
    int completions = 0;

    containers().forceRefreshAllContainersWithCompletion([&completions] { ++completions; });
    queue().pump();

    EXPECT_EQ(completions, 1);
    EXPECT_EQ(log().lines().size(), 1U);
}

} // namespace
} // namespace nimbra::device
