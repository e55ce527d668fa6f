#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/documents/ProgressPublisher.h"
#include "device/json/JsonReader.h"
#include "device/system/StandingTime.h"
#include "host/core/FooterDescription.h"
#include "host/core/PaneSession.h"
#include "host/core/trace/Trace.h"
#include "platform/documents/DaemonConnection.h"
#include "platform/system/DistributedNotificationCenter.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::host {
namespace {

constexpr int kOpenings = 1000;

/// A session whose trace is counted.
class ManyOpenings : public testing::Test {
protected:
    ManyOpenings() {
        const auto reader = device::JsonReader::parse(
            R"({"accounts": [{"identifier": "primary", "primary": true, "usesStratafile": true,
                              "enabled": ["kAccountDataclassTidewater"]}],
                "documents": {"identity": "token", "lastSyncDate": "2024-03-05T14:00:00Z",
                              "lastSyncText": "Synced."}})",
            "device");
        const auto given = device::readDeviceDescription(reader.value());
        EXPECT_FALSE(reader->problem());
        const auto root = _directory.path() / "device";
        EXPECT_TRUE(device::createDeviceDirectory(root, given.description));
        // The minute of the footers' timers does not end while the test runs.
        auto session = PaneSession::start(
            {.root = root,
             .bundle = NIMBRA_PANE_BUNDLE,
             .trace = &_trace,
             .timeSource = std::make_shared<device::StandingTime>(given.description.now)});
        EXPECT_TRUE(session) << session.error();
        _session = std::move(*session);
    }

    void openAndClose() const {
        ASSERT_TRUE(_session->openPane({}));
        _session->settle();
        _session->appear();
        _session->settle();
        _session->closePane();
        _session->settle();
    }

    [[nodiscard]] std::ptrdiff_t linesWith(const std::string& text) const {
        return std::ranges::count_if(
            _lines, [&](const std::string& line) { return line.find(text) != std::string::npos; });
    }

    test::TemporaryDirectory _directory;
    std::vector<std::string> _lines;
    Trace _trace{[this](const std::string& line) { _lines.push_back(line); }};
    std::unique_ptr<PaneSession> _session;
};

TEST_F(ManyOpenings, LeaveOneRegistrationAndOneTimerEachAndNothingElse) {
    for (int opening = 0; opening < kOpenings; ++opening) {
        openAndClose();
    }

    // Each footer keeps its registration for news of the last sync and its timer: that is meant.
    EXPECT_EQ(linesWith(R"("op":"add","center":"distributed")"), kOpenings);
    EXPECT_EQ(linesWith(R"("op":"remove","center":"distributed")"), 0);
    EXPECT_EQ(linesWith(R"("event":"timer","queue":"main","op":"resume")"), kOpenings);
    EXPECT_EQ(linesWith(R"("op":"suspend")") + linesWith(R"("op":"cancel")"), 0);
    // What each opening has taken beside them it has given back.
    EXPECT_EQ(linesWith(R"("op":"_addSubscriberForFileURL:withPublishingHandler:")"), kOpenings);
    EXPECT_EQ(linesWith(R"("op":"_removeSubscriber:")"), kOpenings);
    EXPECT_GT(linesWith(R"("op":"add","center":"local")"), 0);
    EXPECT_EQ(linesWith(R"("op":"add","center":"local")"),
              linesWith(R"("op":"remove","center":"local")"));

    // All that stayed acts, and nothing else does.
    _lines.clear();
    _session->becomeActive();
    _session->settle();
    EXPECT_EQ(_lines, std::vector<std::string>());
    _session->postDistributed({.name = MRDidUpdateLastSyncStatusDistributedNotification,
                               .userInfo = {{MRSyncStatusLastSyncDateKey, Date()}}});
    _session->settle();
    EXPECT_EQ(linesWith(R"("event":"timer","queue":"main","op":"arm")"), kOpenings);
    EXPECT_EQ(_lines.size(), static_cast<std::size_t>(kOpenings));
}

TEST_F(ManyOpenings, TheFooterGoesWithThePlatform) {
    ASSERT_TRUE(_session->openPane({}));
    _session->settle();
    _session->appear();
    _session->settle();
    auto& device = _session->device();
    ASSERT_TRUE(device.progressPublisher().publish(
        "sync", device.daemonConnection().mobileDocumentsURL(), {.description = "Uploading"}));
    _session->settle();
    const std::weak_ptr<HeaderFooterView> footer = _session->footers().first();
    ASSERT_TRUE(FooterDescription::of(*footer.lock()).syncing);
    ASSERT_TRUE(FooterDescription::of(*footer.lock()).timerRunning);

    _session->closePane();
    _session->settle();
    EXPECT_FALSE(footer.expired()) << "its timer and its registration hold it";
    _session.reset();

    EXPECT_TRUE(footer.expired());
}

} // namespace
} // namespace nimbra::host
