#include "device/documents/ProgressPublisher.h"

#include "device/documents/DeviceProgressReports.h"
#include "tests/device/documents/ProgressObserver.h"
#include "tests/support/PumpedQueue.h"

#include <algorithm>
#include <atomic>
#include <gtest/gtest.h>
#include <optional>
#include <thread>

namespace nimbra::device {
namespace {

using Calls = std::vector<std::string>;

ProgressChanges fractionOf(double fraction) {
    return {.values = {.fraction = fraction}, .keys = {ProgressKey::fraction}};
}

class ProgressPublisherTest : public testing::Test {
protected:
    ProgressPublisherTest() {
        _publisher.emplace(_mainQueue, _reports);
        _subscriber = _reports._addSubscriberForFileURLWithPublishingHandler(
            "file:///drive", [this](const std::shared_ptr<ProgressReport>& progress) {
                shown().calls.emplace_back("published");
                for (const KeyPath& keyPath :
                     {localizedDescriptionKeyPath, fractionCompletedKeyPath}) {
                    progress->addObserver(_shown, {.forKeyPath = keyPath,
                                                   .options = KeyValueObservingOptions::initial});
                }
                return [this] { shown().calls.emplace_back("unpublished"); };
            });
    }

    [[nodiscard]] std::expected<void, Error> publish(const std::string& id,
                                                     const std::string& description) {
        return publisher().publish(id, "file:///drive/",
                                   {.fraction = 0.25, .description = Text(description)});
    }
    void endPublisher() { _publisher.reset(); }
    [[nodiscard]] ProgressPublisher& publisher() { return *_publisher; }
    [[nodiscard]] test::PumpedQueue& mainQueue() { return _mainQueue; }
    [[nodiscard]] test::ProgressObserver& shown() { return *_shown; }
    Calls pumped() {
        _mainQueue.pump();
        return std::exchange(shown().calls, {});
    }

private:
    test::PumpedQueue _mainQueue{"main"};
    DeviceProgressReports _reports{_mainQueue};
    std::optional<ProgressPublisher> _publisher;
    std::shared_ptr<test::ProgressObserver> _shown = std::make_shared<test::ProgressObserver>();
    std::shared_ptr<ProgressSubscriber> _subscriber;
};

TEST_F(ProgressPublisherTest, ProgressIsToldOnTheMainQueue) {
    EXPECT_TRUE(publish("a", "one"));
    EXPECT_TRUE(shown().calls.empty());
    EXPECT_EQ(pumped(),
              (Calls{"published", "localizedDescription one!", "fractionCompleted 25%!"}));

    EXPECT_TRUE(publisher().update("a", fractionOf(0.5)));
    EXPECT_TRUE(shown().calls.empty());
    EXPECT_EQ(pumped(), (Calls{"fractionCompleted 50%"}));

    EXPECT_TRUE(publisher().unpublish("a"));
    EXPECT_TRUE(shown().calls.empty());
    EXPECT_EQ(pumped(), (Calls{"unpublished"}));
}

TEST_F(ProgressPublisherTest, WhatCannotBeDoneIsAnError) {
    EXPECT_TRUE(publish("a", "one"));

    const auto twice = publish("a", "two");
    const auto update = publisher().update("b", fractionOf(1));
    const auto unpublish = publisher().unpublish("b");

    ASSERT_FALSE(twice || update || unpublish);
    EXPECT_EQ(twice.error().description, "a progress \"a\" is published already");
    EXPECT_EQ(update.error().description, "no progress \"b\" is published");
    EXPECT_EQ(unpublish.error().description, "no progress \"b\" is published");
    EXPECT_EQ(pumped().front(), "published");

    EXPECT_TRUE(publisher().unpublish("a"));
    EXPECT_FALSE(publisher().update("a", fractionOf(1)));
    EXPECT_FALSE(publisher().unpublish("a"));
    EXPECT_EQ(pumped(), (Calls{"unpublished"}));
}

TEST_F(ProgressPublisherTest, ChangesThatWaitAreToldAsOneWithTheLastValues) {
    EXPECT_TRUE(publish("a", "one"));
    pumped();

    EXPECT_TRUE(publisher().update("a", fractionOf(0.5)));
    EXPECT_TRUE(publisher().update(
        "a", {.values = {.description = "two"}, .keys = {ProgressKey::description}}));
    EXPECT_TRUE(publisher().update("a", fractionOf(0.75)));

    EXPECT_EQ(mainQueue().pendingCount(), 1U);
    EXPECT_EQ(pumped(), (Calls{"localizedDescription two", "fractionCompleted 75%"}));
}

TEST_F(ProgressPublisherTest, TheFirstValuesAreShownBeforeChangesThatCameAtOnce) {
    EXPECT_TRUE(publish("a", "one"));
    EXPECT_TRUE(publisher().update("a", fractionOf(0.5)));
    EXPECT_TRUE(publisher().update("a", fractionOf(1)));

    EXPECT_EQ(pumped(), (Calls{"published", "localizedDescription one!", "fractionCompleted 25%!",
                               "fractionCompleted 100%"}));
}

TEST_F(ProgressPublisherTest, TheLastChangesAreShownBeforeTheEnd) {
    EXPECT_TRUE(publish("a", "one"));
    pumped();
    EXPECT_TRUE(publisher().update("a", fractionOf(1)));
    EXPECT_TRUE(publisher().unpublish("a"));

    EXPECT_EQ(pumped(), (Calls{"fractionCompleted 100%", "unpublished"}));
}

TEST_F(ProgressPublisherTest, ANameCanBeUsedAgain) {
    EXPECT_TRUE(publish("a", "one"));
    pumped();
    EXPECT_TRUE(publisher().unpublish("a"));
    EXPECT_TRUE(publish("a", "two"));
    EXPECT_FALSE(publish("a", "three"));

    EXPECT_EQ(pumped(), (Calls{"unpublished", "published", "localizedDescription two!",
                               "fractionCompleted 25%!"}));
}

TEST_F(ProgressPublisherTest, WhatEndsBeforeTheMainQueueComesIsNotShown) {
    for (int count = 0; count < 1000; ++count) {
        EXPECT_TRUE(publish("a", "one"));
        EXPECT_TRUE(publisher().update("a", fractionOf(0.5)));
        EXPECT_TRUE(publisher().unpublish("a"));
    }

    EXPECT_EQ(mainQueue().pendingCount(), 1U);
    EXPECT_EQ(pumped(), Calls{});
    EXPECT_TRUE(publish("a", "one"));
    EXPECT_EQ(pumped().size(), 3U);
}

TEST_F(ProgressPublisherTest, NothingToChangeIsNoWork) {
    EXPECT_TRUE(publish("a", "one"));
    pumped();

    EXPECT_TRUE(publisher().update("a", {}));

    EXPECT_EQ(mainQueue().pendingCount(), 0U);
}

TEST_F(ProgressPublisherTest, WhatWaitsWhenThePublisherGoesIsDropped) {
    EXPECT_TRUE(publish("a", "one"));

    endPublisher();

    EXPECT_EQ(pumped(), Calls{});
}

TEST_F(ProgressPublisherTest, ManyChangesFromAnotherThreadKeepTheQueueShortAndEndWithTheLast) {
    constexpr int changes = 10000;
    std::size_t longest = 0;
    std::atomic<bool> hasEnded = false;
    {
        const std::jthread publishing([this, &longest, &hasEnded] {
            EXPECT_TRUE(publish("a", "one"));
            for (int count = 1; count <= changes; ++count) {
                EXPECT_TRUE(publisher().update("a", fractionOf(1.0 * count / changes)));
                longest = std::max(longest, mainQueue().pendingCount());
            }
            hasEnded = true;
        });
        while (!hasEnded) {
            mainQueue().pumpOne();
        }
    }
    mainQueue().pump();

    // One of the publisher, and one that calls the handler.
    EXPECT_LE(longest, 2U);
    ASSERT_GE(shown().calls.size(), 4U);
    EXPECT_EQ(shown().calls[2], "fractionCompleted 25%!");
    EXPECT_EQ(shown().calls.back(), "fractionCompleted 100%");
}

} // namespace
} // namespace nimbra::device
