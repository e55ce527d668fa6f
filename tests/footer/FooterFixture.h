#pragma once

#include "footer/RSPNimbraDriveProgressFooterView.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "platform/views/Window.h"
#include "tests/support/FakeProgress.h"
#include "tests/support/SyslogCapture.h"
#include "tests/support/TestPlatform.h"

#include <chrono>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <vector>

namespace nimbra::test {

using Calls = std::vector<std::string>;

/// The footer of a status group, with "Synced." as the sentence of the last sync and no date of it.
struct FooterFixture : testing::Test {
    TestPlatform platform;
    SyslogCapture syslog;
    Window window;
    const Date now = Date(std::chrono::seconds(1'700'000'000));
    std::shared_ptr<RSPNimbraDriveProgressFooterView> view;

    FooterFixture() {
        platform.clock.date = now;
        platform.lastSync.sentence = Text("Synced.");
        view = RSPNimbraDriveProgressFooterView::initWithFrame({}, platform.services());
    }
    /// Lets go of what holds the view, as the platform does when it shuts down.
    ~FooterFixture() override {
        platform.progressReports.finish();
        platform.distributedNotificationCenter.registrations.clear();
        timer().cancel();
    }

    [[nodiscard]] FakeTimer& timer() const { return *platform.workQueues.timers().at(0); }
    [[nodiscard]] const Text& text() const { return view->statusLabel()->text(); }
    /// Whether the timer keeps the sentence fresh.
    [[nodiscard]] bool isAutoUpdating() const {
        return view->valueForKey(KeyPath("lastSyncAutoUpdate")) == RowValue(true);
    }
    [[nodiscard]] bool isBarHidden() const { return view->progressBar()->isHidden(); }

    /// The daemon has this date of the last sync.
    void storeAge(Date::duration age) { platform.lastSync.date = now - age; }

    /// A notification comes in that carries `userInfo`.
    void postLastSync(const UserInfo& userInfo) {
        platform.distributedNotificationCenter.postNotification(
            {.name = MRDidUpdateLastSyncStatusDistributedNotification, .userInfo = userInfo});
        platform.workQueues.mainQueue().pump();
    }

    /// What was asked of the progress reports and the last sync since the last question.
    [[nodiscard]] Calls takeCalls() {
        Calls calls;
        calls.swap(platform.calls);
        return calls;
    }

    [[nodiscard]] static std::shared_ptr<FakeProgress> progressCalled(Text description) {
        auto progress = std::make_shared<FakeProgress>();
        progress->description = std::move(description);
        return progress;
    }
};

} // namespace nimbra::test
