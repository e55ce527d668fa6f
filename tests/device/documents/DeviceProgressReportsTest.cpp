#include "device/documents/DeviceProgressReports.h"

#include "device/documents/DeviceProgress.h"
#include "tests/support/PumpedQueue.h"

#include <gtest/gtest.h>
#include <optional>

namespace nimbra::device {
namespace {

using Calls = std::vector<std::string>;

class DeviceProgressReportsTest : public testing::Test {
protected:
    DeviceProgressReportsTest() { _reports.emplace(_mainQueue); }

    /// Subscribes with handlers that write "NAME+PROGRESS" and "NAME-PROGRESS".
    std::shared_ptr<ProgressSubscriber> subscribe(const std::string& name,
                                                  const std::string& url = "file:///drive/") {
        return reports()._addSubscriberForFileURLWithPublishingHandler(
            url, [this, name, held = _held](const std::shared_ptr<ProgressReport>& progress) {
                const std::string what = progress->localizedDescription().string();
                _calls.push_back(name + '+' + what);
                return [this, name, what, held] { _calls.push_back(name + '-' + what); };
            });
    }
    std::shared_ptr<ProgressReport> publish(const std::string& what,
                                            const std::string& url = "file:///drive/") {
        const auto progress =
            std::make_shared<DeviceProgress>(ProgressValues{.description = Text(what)});
        reports().publish(url, progress);
        return progress;
    }
    void end() { _reports.reset(); }

    [[nodiscard]] DeviceProgressReports& reports() { return *_reports; }
    [[nodiscard]] test::PumpedQueue& mainQueue() { return _mainQueue; }
    [[nodiscard]] const Calls& calls() const { return _calls; }
    /// How many handlers there are.
    [[nodiscard]] long handlers() const { return _held.use_count() - 1; }
    [[nodiscard]] Calls pumped() {
        _mainQueue.pump();
        return std::exchange(_calls, {});
    }

private:
    test::PumpedQueue _mainQueue{"main"};
    std::shared_ptr<int> _held = std::make_shared<int>();
    Calls _calls;
    std::optional<DeviceProgressReports> _reports;
};

TEST_F(DeviceProgressReportsTest, WhatIsPublishedLaterIsToldWithItsEnd) {
    const auto subscriber = subscribe("s");
    EXPECT_EQ(mainQueue().pendingCount(), 0U);

    const auto progress = publish("p");
    EXPECT_TRUE(calls().empty());
    EXPECT_EQ(pumped(), (Calls{"s+p"}));

    reports().unpublish(progress);
    EXPECT_TRUE(calls().empty());
    EXPECT_EQ(pumped(), (Calls{"s-p"}));
    reports().unpublish(progress);
    EXPECT_EQ(pumped(), Calls{});
}

TEST_F(DeviceProgressReportsTest, WhatIsPublishedAlreadyIsToldSoonButNotWithinTheSubscription) {
    publish("first");
    publish("second");
    reports().unpublish(publish("gone"));

    const auto subscriber = subscribe("s");

    EXPECT_TRUE(calls().empty());
    EXPECT_EQ(pumped(), (Calls{"s+first", "s+second"}));
}

TEST_F(DeviceProgressReportsTest, AProgressThatEndsBeforeItWasToldIsToldWithItsEnd) {
    const auto subscriber = subscribe("s");

    reports().unpublish(publish("p"));

    EXPECT_EQ(pumped(), (Calls{"s+p", "s-p"}));
}

TEST_F(DeviceProgressReportsTest, ASubscriptionIsForAFileAndWhatIsBelowIt) {
    const auto slash = subscribe("slash", "file:///drive/");
    const auto plain = subscribe("plain", "file:///drive");
    const auto deep = subscribe("deep", "file:///drive/a/");

    publish("at", "file:///drive");
    publish("at/", "file:///drive/");
    publish("below", "file:///drive/a");
    publish("beside", "file:///drives");
    publish("above", "file:///");

    EXPECT_EQ(pumped(), (Calls{"slash+at", "plain+at", "slash+at/", "plain+at/", "slash+below",
                               "plain+below", "deep+below"}));
}

TEST_F(DeviceProgressReportsTest, RemovingASubscriberTellsTheEndOfWhatIsStillPublished) {
    const auto subscriber = subscribe("s");
    const auto other = subscribe("o");
    publish("p");
    const auto ended = publish("e");
    reports().unpublish(ended);
    EXPECT_EQ(pumped(), (Calls{"s+p", "o+p", "s+e", "o+e", "s-e", "o-e"}));

    reports()._removeSubscriber(subscriber);

    EXPECT_TRUE(calls().empty());
    EXPECT_EQ(pumped(), (Calls{"s-p"}));
    reports()._removeSubscriber(subscriber);
    publish("later");
    EXPECT_EQ(pumped(), (Calls{"o+later"}));
}

TEST_F(DeviceProgressReportsTest, WhatWaitsForARemovedSubscriberIsDropped) {
    const auto subscriber = subscribe("s");
    publish("p");

    reports()._removeSubscriber(subscriber);

    EXPECT_EQ(handlers(), 0);
    EXPECT_EQ(pumped(), Calls{});
}

TEST_F(DeviceProgressReportsTest, AnEndThatWaitsWhenTheSubscriberIsRemovedIsToldOnce) {
    const auto subscriber = subscribe("s");
    const auto progress = publish("p");
    EXPECT_EQ(pumped(), (Calls{"s+p"}));

    reports().unpublish(progress);
    reports()._removeSubscriber(subscriber);

    EXPECT_EQ(pumped(), (Calls{"s-p"}));
    EXPECT_EQ(handlers(), 0);
}

TEST_F(DeviceProgressReportsTest, TheHandlersGoOnceTheyCannotBeCalledAnyMore) {
    const auto subscriber = subscribe("s");
    const auto progress = publish("p");
    EXPECT_EQ(handlers(), 1);
    EXPECT_EQ(pumped(), (Calls{"s+p"}));
    EXPECT_EQ(handlers(), 2);

    reports().unpublish(progress);
    EXPECT_EQ(pumped(), (Calls{"s-p"}));
    EXPECT_EQ(handlers(), 1);

    // The token, which is still there, holds nothing.
    reports()._removeSubscriber(subscriber);
    EXPECT_EQ(handlers(), 0);
}

TEST_F(DeviceProgressReportsTest, ATokenThatIsLetGoKeepsTheSubscription) {
    subscribe("s").reset();

    publish("p");

    EXPECT_EQ(pumped(), (Calls{"s+p"}));
}

TEST_F(DeviceProgressReportsTest, AHandlerMayEndItsSubscription) {
    int ends = 0;
    std::shared_ptr<ProgressSubscriber> subscriber;
    subscriber = reports()._addSubscriberForFileURLWithPublishingHandler(
        "file:///drive", [&](const std::shared_ptr<ProgressReport>& /*progress*/) {
            reports()._removeSubscriber(subscriber);
            return [&ends] { ++ends; };
        });
    publish("p");
    publish("q");

    mainQueue().pump();

    EXPECT_EQ(ends, 1);
}

TEST_F(DeviceProgressReportsTest, AHandlerMaySubscribeAndReturnNothing) {
    std::shared_ptr<ProgressSubscriber> inner;
    const auto outer = reports()._addSubscriberForFileURLWithPublishingHandler(
        "file:///drive",
        [&](const std::shared_ptr<ProgressReport>& /*progress*/)
            -> ProgressReports::UnpublishingHandler {
            inner = subscribe("inner");
            return nullptr;
        });

    const auto progress = publish("p");
    EXPECT_EQ(pumped(), (Calls{"inner+p"}));
    reports().unpublish(progress);
    EXPECT_EQ(pumped(), (Calls{"inner-p"}));
}

TEST_F(DeviceProgressReportsTest, AtTheEndAllHandlersGoUncalled) {
    const auto kept = subscribe("s");
    const auto removed = subscribe("r");
    publish("p");
    EXPECT_EQ(pumped(), (Calls{"s+p", "r+p"}));
    reports()._removeSubscriber(removed);
    publish("waiting");

    reports().finish();

    EXPECT_EQ(handlers(), 0);
    EXPECT_EQ(pumped(), Calls{});
    // Nor is anything taken any more.
    const auto late = subscribe("late");
    publish("late");
    reports()._removeSubscriber(kept);
    EXPECT_EQ(handlers(), 0);
    EXPECT_EQ(pumped(), Calls{});
}

TEST_F(DeviceProgressReportsTest, WhatStillWaitsWhenTheReportsAreGoneDoesNothing) {
    const auto subscriber = subscribe("s");
    publish("p");

    end();

    EXPECT_EQ(handlers(), 0);
    EXPECT_EQ(pumped(), Calls{});
}

TEST_F(DeviceProgressReportsTest, WhatAHandlerHoldsMayComeBackWhenItGoes) {
    struct Comeback {
        DeviceProgressReports& reports;
        std::shared_ptr<ProgressSubscriber> subscriber;
        ~Comeback() { reports._removeSubscriber(subscriber); }
    };
    const auto other = subscribe("o");
    {
        const auto comeback = std::make_shared<Comeback>(reports(), other);
        static_cast<void>(reports()._addSubscriberForFileURLWithPublishingHandler(
            "file:///drive", [comeback](const auto& /*progress*/) { return [comeback] {}; }));
    }
    publish("p");
    EXPECT_EQ(pumped(), (Calls{"o+p"}));

    reports().finish();

    EXPECT_EQ(handlers(), 0);
}

TEST_F(DeviceProgressReportsTest, TheFirstSubscriptionIsToldOfOnce) {
    int count = 0;
    reports().setFirstSubscriptionHandler([&count] { ++count; });
    publish("p");
    EXPECT_EQ(count, 0);

    const auto first = subscribe("a");
    EXPECT_EQ(count, 1);
    const auto second = subscribe("b");
    EXPECT_EQ(count, 1);
}

} // namespace
} // namespace nimbra::device
