#include "device/documents/DeviceLastSync.h"

#include "device/description/Instant.h"
#include "tests/device/TestFiles.h"
#include "tests/support/FakeClock.h"
#include "tests/support/TemporaryDirectory.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

constexpr const char* errorJson =
    R"({"error": {"domain": "Daemon", "code": 7, "description": "is busy"}})";
const Error daemonIsBusy{.domain = "Daemon", .code = 7, .description = "is busy"};

class DeviceLastSyncTest : public testing::Test {
protected:
    DeviceLastSyncTest() {
        _clock.date = parseInstant("2024-03-05T14:07:09Z").value();
        test::writeTestFile(state("device.json"), R"({"locale": "de", "timeZone": "UTC"})");
        const auto settings = DeviceSettings::open(_directory.path());
        _lastSync.emplace(DevicePaths(_directory.path()), settings.value(), _clock);
    }

    void writeDocuments(const std::string& text) const {
        test::writeTestFile(state("documents.json"), text);
    }
    void wait(std::chrono::minutes time) { _clock.date += time; }
    [[nodiscard]] std::filesystem::path state(const std::string& name) const {
        return _directory.path() / "var/lib/nimbra" / name;
    }
    /// The date, which is no error; nothing where there was no sync.
    [[nodiscard]] std::optional<Date> dateOfFile() const { return date().value(); }
    [[nodiscard]] std::expected<std::optional<Date>, Error> date() const {
        return _lastSync->MRGetLastSyncDateWithError();
    }
    [[nodiscard]] std::expected<Text, Error> sentence() const {
        return _lastSync->MRGetLocalizedLastSyncWithError();
    }

private:
    test::TemporaryDirectory _directory;
    test::FakeClock _clock;
    std::optional<DeviceLastSync> _lastSync;
};

TEST_F(DeviceLastSyncTest, TheDateIsTheOneOfTheFileNow) {
    writeDocuments(R"({"lastSyncDate": "2024-03-05T14:00:00+01:00"})");
    EXPECT_EQ(dateOfFile(), parseInstant("2024-03-05T13:00:00Z"));

    writeDocuments(R"({"lastSyncDate": null})");
    EXPECT_EQ(dateOfFile(), std::nullopt);

    writeDocuments("{}");
    EXPECT_EQ(dateOfFile(), std::nullopt);
}

TEST_F(DeviceLastSyncTest, AnErrorInTheDatesPlaceIsTheAnswer) {
    writeDocuments(std::string(R"({"lastSyncDate": )") + errorJson + "}");

    ASSERT_FALSE(date());
    EXPECT_EQ(date().error(), daemonIsBusy);
    // Nothing can be composed from it either.
    ASSERT_FALSE(sentence());
    EXPECT_EQ(sentence().error(), daemonIsBusy);
}

TEST_F(DeviceLastSyncTest, AGivenSentenceIsTheAnswerWhateverTheDate) {
    writeDocuments(R"({"lastSyncDate": "2024-03-05T14:00:00Z", "lastSyncText": "Long ago"})");
    EXPECT_EQ(sentence().value(), Text("Long ago"));

    writeDocuments(R"({"lastSyncDate": "2024-03-05T14:00:00Z", "lastSyncText": ""})");
    EXPECT_EQ(sentence().value(), Text(""));

    writeDocuments(R"({"lastSyncDate": "2024-03-05T14:00:00Z", "lastSyncText": null})");
    EXPECT_EQ(sentence().value(), Text());

    writeDocuments(std::string(R"({"lastSyncText": )") + errorJson + "}");
    ASSERT_FALSE(sentence());
    EXPECT_EQ(sentence().error(), daemonIsBusy);
    EXPECT_EQ(dateOfFile(), std::nullopt);
}

TEST_F(DeviceLastSyncTest, ASentenceThatIsLeftOutIsComposedFromTheDate) {
    writeDocuments(R"({"lastSyncDate": "2024-03-05T14:05:00Z"})");
    EXPECT_EQ(sentence().value(), Text("Zuletzt vor 2 Minuten synchronisiert"));

    wait(std::chrono::minutes(1));
    EXPECT_EQ(sentence().value(), Text("Zuletzt vor 3 Minuten synchronisiert"));

    writeDocuments(R"({"lastSyncDate": null})");
    EXPECT_EQ(sentence().value(), Text());
}

TEST_F(DeviceLastSyncTest, AFileThatCannotBeReadIsAnErrorOfBoth) {
    const std::string message =
        "/var/lib/nimbra/documents.json: cannot be read: No such file or directory";

    ASSERT_FALSE(date());
    EXPECT_EQ(date().error().description, message);
    ASSERT_FALSE(sentence());
    EXPECT_EQ(sentence().error().description, message);
}

} // namespace
} // namespace nimbra::device
