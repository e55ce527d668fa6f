#include "device/system/DeviceNotificationCenter.h"

#include "tests/device/Threads.h"
#include "tests/support/PumpedQueue.h"

#include <atomic>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using Calls = std::vector<std::string>;

class DeviceNotificationCenterTest : public testing::Test {
protected:
    [[nodiscard]] NotificationCenter::Block recording(const char* who) {
        return [this, who](const Notification& /*notification*/) { calls.emplace_back(who); };
    }

    DeviceNotificationCenter center;     // NOLINT(*-non-private-member-*): for the tests
    Calls calls;                         // NOLINT(*-non-private-member-*)
    const NotificationName name{"name"}; // NOLINT(*-non-private-member-*)
};

TEST_F(DeviceNotificationCenterTest, ObserversAreToldAtOnceInTheOrderOfRegistration) {
    const auto first = center.addObserverForName(name, {.usingBlock = recording("first")});
    const auto other =
        center.addObserverForName(NotificationName("other"), {.usingBlock = recording("other")});
    const auto second = center.addObserverForName(name, {.usingBlock = recording("second")});

    center.postNotification({.name = name});

    EXPECT_EQ(calls, (Calls{"first", "second"}));
}

TEST_F(DeviceNotificationCenterTest, TheBlockGetsWhatWasPosted) {
    const int sender = 0;
    Notification seen{.name = NotificationName("")};
    const auto token = center.addObserverForName(
        name, {.usingBlock = [&seen](const Notification& posted) { seen = posted; }});

    center.postNotification(
        {.name = name, .object = &sender, .userInfo = {{UserInfoKey("key"), std::int64_t{7}}}});

    EXPECT_EQ(seen.name, name);
    EXPECT_EQ(seen.object, &sender);
    EXPECT_EQ(userInfoValue<std::int64_t>(seen.userInfo, UserInfoKey("key")), 7);
}

TEST_F(DeviceNotificationCenterTest, AnObserverMayAskForOneSendersPostingsOnly) {
    const int sender = 0;
    const int stranger = 0;
    const auto token =
        center.addObserverForName(name, {.object = &sender, .usingBlock = recording("told")});

    center.postNotification({.name = name});
    center.postNotification({.name = name, .object = &stranger});
    EXPECT_TRUE(calls.empty());

    center.postNotification({.name = name, .object = &sender});
    EXPECT_EQ(calls, Calls{"told"});
}

TEST_F(DeviceNotificationCenterTest, ABlockWithAQueueRunsThere) {
    test::PumpedQueue queue("queue");
    const auto token =
        center.addObserverForName(name, {.queue = &queue, .usingBlock = recording("told")});

    center.postNotification({.name = name});
    EXPECT_TRUE(calls.empty());
    queue.pump();

    EXPECT_EQ(calls, Calls{"told"});
}

TEST_F(DeviceNotificationCenterTest, ABlockThatWaitsOnItsQueueIsNotRunAfterItsRemoval) {
    test::PumpedQueue queue("queue");
    const auto token =
        center.addObserverForName(name, {.queue = &queue, .usingBlock = recording("told")});

    center.postNotification({.name = name});
    center.removeObserver(token);
    queue.pump();

    EXPECT_TRUE(calls.empty());
}

TEST_F(DeviceNotificationCenterTest, ARemovedObserverIsNotToldAndItsBlockIsLetGo) {
    const auto captured = std::make_shared<int>(0);
    const auto token = center.addObserverForName(
        name, {.usingBlock = [captured](const Notification&) { ++*captured; }});

    center.postNotification({.name = name});
    center.removeObserver(token);
    center.postNotification({.name = name});

    EXPECT_EQ(*captured, 1);
    EXPECT_EQ(captured.use_count(), 1);
}

TEST_F(DeviceNotificationCenterTest, LettingTheTokenGoDoesNotEndTheRegistration) {
    static_cast<void>(center.addObserverForName(name, {.usingBlock = recording("told")}));

    center.postNotification({.name = name});

    EXPECT_EQ(calls, Calls{"told"});
}

TEST_F(DeviceNotificationCenterTest, RemovingNothingIsNothing) {
    const auto token = center.addObserverForName(name, {.usingBlock = recording("gone")});
    const auto staying = center.addObserverForName(name, {.usingBlock = recording("told")});

    center.removeObserver(nullptr);
    center.removeObserver(token);
    center.removeObserver(token);
    center.postNotification({.name = name});

    EXPECT_EQ(calls, Calls{"told"});
}

TEST_F(DeviceNotificationCenterTest, ABlockMayRemoveItselfAndOthersAndAddMore) {
    std::shared_ptr<ObserverToken> self;
    std::shared_ptr<ObserverToken> later;
    const auto block = [&](const Notification&) {
        calls.emplace_back("remover");
        center.removeObserver(self);
        center.removeObserver(later);
        static_cast<void>(center.addObserverForName(name, {.usingBlock = recording("added")}));
    };
    self = center.addObserverForName(name, {.usingBlock = block});
    later = center.addObserverForName(name, {.usingBlock = recording("later")});

    center.postNotification({.name = name});
    EXPECT_EQ(calls, Calls{"remover"});
    center.postNotification({.name = name});
    EXPECT_EQ(calls, (Calls{"remover", "added"}));
}

TEST_F(DeviceNotificationCenterTest, ABlockMayPost) {
    const NotificationName second("second");
    const auto outer = center.addObserverForName(name, {.usingBlock = [&](const Notification&) {
                                                     calls.emplace_back("outer");
                                                     center.postNotification({.name = second});
                                                 }});
    const auto inner = center.addObserverForName(second, {.usingBlock = recording("inner")});

    center.postNotification({.name = name});

    EXPECT_EQ(calls, (Calls{"outer", "inner"}));
}

TEST_F(DeviceNotificationCenterTest, ManyThreadsMayPostWhileObserversComeAndGo) {
    constexpr int rounds = 200;
    std::atomic<int> told = 0;
    const auto staying =
        center.addObserverForName(name, {.usingBlock = [&told](const Notification&) { ++told; }});
    const auto post = [this] {
        for (int round = 0; round < rounds; ++round) {
            center.postNotification({.name = name});
        }
    };
    const auto comeAndGo = [this] {
        for (int round = 0; round < rounds; ++round) {
            const auto held = std::make_shared<std::atomic<int>>(0);
            const auto token = center.addObserverForName(
                name, {.usingBlock = [held](const Notification&) { ++*held; }});
            center.removeObserver(token);
        }
    };

    test::runAtOnce({post, post, post, comeAndGo});

    EXPECT_EQ(told, 3 * rounds);
}

} // namespace
} // namespace nimbra::device
