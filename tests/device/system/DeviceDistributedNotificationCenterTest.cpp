#include "device/system/DeviceDistributedNotificationCenter.h"

#include "device/system/Backlog.h"
#include "device/system/DeviceWorkQueues.h"
#include "device/system/NotificationMessage.h"
#include "tests/device/OtherProcess.h"
#include "tests/device/RecordingLog.h"
#include "tests/device/TestFiles.h"
#include "tests/device/Threads.h"
#include "tests/support/PumpedQueue.h"
#include "tests/support/TemporaryDirectory.h"

#include <algorithm>
#include <atomic>
#include <cstring>
#include <future>
#include <gtest/gtest.h>
#include <memory>
#include <string>
#include <sys/socket.h>
#include <sys/un.h>
#include <thread>
#include <unistd.h>
#include <utility>
#include <vector>

namespace nimbra::device {
namespace {

using Calls = std::vector<std::string>;
using Center = DeviceDistributedNotificationCenter;

class DeviceDistributedNotificationCenterTest : public testing::Test {
protected:
    [[nodiscard]] std::filesystem::path root() const { return _directory.path(); }
    [[nodiscard]] std::filesystem::path folder() const {
        return root() / "run/nimbra/notifications";
    }
    [[nodiscard]] std::unique_ptr<Center> makeCenter() {
        return std::make_unique<Center>(DevicePaths(root()), _log, std::chrono::milliseconds(0));
    }
    [[nodiscard]] NotificationCenter::Observation recording(const char* who) {
        return {.queue = &_queue,
                .usingBlock = [this, who](const Notification&) { _calls.emplace_back(who); }};
    }
    [[nodiscard]] std::vector<std::string> sockets() const {
        std::vector<std::string> names;
        if (std::filesystem::exists(folder())) {
            for (const auto& entry : std::filesystem::directory_iterator(folder())) {
                names.push_back(entry.path().filename().string());
            }
        }
        return names;
    }
    /// Sends `message` to the one socket there is, as a stranger.
    void sendRaw(const std::string& message) const {
        const auto names = sockets();
        ASSERT_EQ(names.size(), 1U);
        const int socket = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
        const sockaddr_un address = addressOf(folder() / names.front());
        EXPECT_EQ(::sendto(socket, message.data(), message.size(), 0,
                           reinterpret_cast<const sockaddr*>(&address), sizeof address),
                  static_cast<ssize_t>(message.size()));
        ::close(socket);
    }
    [[nodiscard]] static sockaddr_un addressOf(const std::filesystem::path& path) {
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        EXPECT_LT(path.native().size(), sizeof address.sun_path);
        std::memcpy(&address.sun_path, path.c_str(), path.native().size());
        return address;
    }

    [[nodiscard]] test::PumpedQueue& queue() { return _queue; }
    [[nodiscard]] const Calls& calls() const { return _calls; }
    [[nodiscard]] Calls logged() const { return _log.lines(); }
    [[nodiscard]] test::RecordingLog& log() { return _log; }
    [[nodiscard]] static const NotificationName& name() {
        static const NotificationName shared("name");
        return shared;
    }

private:
    test::TemporaryDirectory _directory;
    test::RecordingLog _log;
    test::PumpedQueue _queue{"main"};
    Calls _calls;
};

/// An observation on a thread of its own, whose first notification can be waited for.
class Awaited {
public:
    [[nodiscard]] NotificationCenter::Observation observation() {
        return {.queue = _queue.get(), .usingBlock = [this](const Notification& notification) {
                    if (!std::exchange(_came, true)) {
                        _first.set_value(notification);
                    }
                }};
    }
    [[nodiscard]] Notification first() { return _first.get_future().get(); }

private:
    bool _came = false; // the queue's own
    std::promise<Notification> _first;
    test::PumpedQueue _mainQueue{"main"};
    DeviceWorkQueues _queues{_mainQueue};
    std::shared_ptr<WorkQueue> _queue = _queues.serialQueueWithLabel("awaited");
};

TEST_F(DeviceDistributedNotificationCenterTest, OwnObserversAreQueuedWhenThePostingReturns) {
    const auto center = makeCenter();
    const auto first = center->addObserverForName(name(), recording("first"));
    const auto other = center->addObserverForName(NotificationName("other"), recording("other"));
    const auto second = center->addObserverForName(name(), recording("second"));

    center->postNotification({.name = name()});
    EXPECT_EQ(queue().pendingCount(), 2U);
    queue().pump();
    EXPECT_EQ(calls(), (Calls{"first", "second"}));
    center->removeObserver(first);
    center->postNotification({.name = name()});
    queue().pump();

    EXPECT_EQ(calls(), (Calls{"first", "second", "second"}));
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, AnotherProcessHearsWhatIsPosted) {
    const Date date(std::chrono::microseconds(1'700'000'000'123'456));
    test::OtherProcess poster([this, date] {
        makeCenter()->postNotification(
            {.name = name(), .userInfo = {{MRSyncStatusLastSyncDateKey, date}}});
    });
    Awaited observer;
    const auto center = makeCenter();
    const auto token = center->addObserverForName(name(), observer.observation());

    poster.run();
    const Notification received = observer.first();
    center->finish();

    EXPECT_EQ(received.name, name());
    EXPECT_EQ(userInfoValue<Date>(received.userInfo, MRSyncStatusLastSyncDateKey), date);
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, TheSocketComesWithTheFirstObserverAndGoesAtTheEnd) {
    auto center = makeCenter();
    center->postNotification({.name = name()});
    EXPECT_FALSE(std::filesystem::exists(folder()));

    const auto first = center->addObserverForName(name(), recording("told"));
    const auto second = center->addObserverForName(name(), recording("told"));
    EXPECT_EQ(sockets().size(), 1U);
    EXPECT_EQ(std::filesystem::status(folder()).permissions(), std::filesystem::perms::owner_all);
    const auto beside = makeCenter();
    const auto third = beside->addObserverForName(name(), recording("told"));
    EXPECT_EQ(sockets().size(), 2U);

    center.reset();
    beside->finish();

    EXPECT_EQ(sockets(), Calls{});
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, ASocketWhoseProcessIsGoneIsRemoved) {
    test::OtherProcess killed([this] {
        const auto center = makeCenter();
        static_cast<void>(center->addObserverForName(name(), recording("told")));
        ::_exit(0);
    });
    killed.run();
    ASSERT_EQ(sockets().size(), 1U);
    test::writeTestFile(folder() / "note", "no socket");

    makeCenter()->postNotification({.name = name()});

    EXPECT_EQ(sockets(), Calls{"note"});
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest,
       SocketsOfAnEarlierProcessOfTheNumberAreInNobodysWay) {
    constexpr int more = 150;
    std::filesystem::create_directories(folder());
    for (int count = 1; count <= more; ++count) {
        const std::string stale = std::to_string(::getpid()) + '.' + std::to_string(count);
        const int socket = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
        const sockaddr_un address = addressOf(folder() / stale);
        ASSERT_EQ(::bind(socket, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
        ::close(socket);
    }

    const auto center = makeCenter();
    static_cast<void>(center->addObserverForName(name(), recording("told")));
    // Whoever still reads is left alone, whatever its name is.
    const auto second = makeCenter();
    static_cast<void>(second->addObserverForName(name(), recording("second")));

    EXPECT_EQ(logged(), Calls{});
    center->postNotification({.name = name()});
    EXPECT_EQ(sockets().size(), 2U);
}

TEST_F(DeviceDistributedNotificationCenterTest, AProcessThatDoesNotKeepUpMissesAPosting) {
    constexpr int more = 10'000; // than any machine queues for one socket
    std::filesystem::create_directories(folder());
    const int silent = ::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0);
    const sockaddr_un address = addressOf(folder() / "1.1");
    ASSERT_EQ(::bind(silent, reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
    const auto center = makeCenter();
    const auto token = center->addObserverForName(name(), recording("told"));

    int posted = 0;
    while (logged().empty() && posted < more) {
        center->postNotification({.name = name()});
        ++posted;
    }
    queue().pump();
    ::close(silent);

    EXPECT_EQ(
        logged(),
        Calls{
            "/run/nimbra/notifications/1.1: cannot be notified: Resource temporarily unavailable"});
    EXPECT_EQ(calls().size(), static_cast<std::size_t>(posted));
}

TEST_F(DeviceDistributedNotificationCenterTest, WhatIsNoNotificationIsLoggedAndIgnored) {
    Awaited observer;
    const auto center = makeCenter();
    const auto token = center->addObserverForName(name(), observer.observation());

    sendRaw("{\"name\": \"na");
    sendRaw("");
    sendRaw(std::string(64UL * 1024UL + 10, ' '));
    sendRaw(R"({"name": "name", "userInfo": {"k": {"integer": 5}}})");
    const Notification received = observer.first();
    center->finish();

    EXPECT_EQ(userInfoValue<std::int64_t>(received.userInfo, UserInfoKey("k")), 5);
    const auto lines = logged();
    ASSERT_EQ(lines.size(), 3U);
    const std::string unreadable = "A notification from another process cannot be read: ";
    EXPECT_TRUE(lines[0].starts_with(unreadable + "notification: line 1, column ")) << lines[0];
    EXPECT_TRUE(lines[1].starts_with(unreadable)) << lines[1];
    EXPECT_EQ(lines[2], "A notification from another process is too long");
}

TEST_F(DeviceDistributedNotificationCenterTest, AFloodWaitsOutsideTheQueue) {
    constexpr std::size_t sent = 1000;
    const auto center = makeCenter();
    static_cast<void>(center->addObserverForName(name(), recording("told")));
    const std::string message = notificationMessage({.name = name()});
    std::size_t most = 0;

    std::thread flood([&] {
        for (std::size_t count = 0; count < sent; ++count) {
            sendRaw(message);
        }
    });
    while (calls().size() < sent) {
        // As slow as can be: one is told when there is no room for another.
        const std::size_t waiting = queue().pendingCount();
        most = std::max(most, waiting);
        if (waiting >= Backlog::most || calls().size() + waiting == sent) {
            queue().pumpOne();
        }
    }
    flood.join();

    EXPECT_LE(most, static_cast<std::size_t>(Backlog::most));
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, ALongNotificationStaysInItsProcess) {
    Awaited observer;
    const auto stranger = makeCenter();
    const auto strangersToken = stranger->addObserverForName(name(), observer.observation());
    const auto center = makeCenter();
    const auto token = center->addObserverForName(name(), recording("told"));
    const auto posting = [](std::size_t length) {
        return Notification{.name = name(),
                            .userInfo = {{UserInfoKey("k"), Text(std::string(length, 'x'))}}};
    };

    center->postNotification(posting(65'536));
    center->postNotification(posting(65'000));
    queue().pump();
    const Notification received = observer.first();

    EXPECT_EQ(received.userInfo, posting(65'000).userInfo);
    EXPECT_EQ(calls(), (Calls{"told", "told"}));
    EXPECT_EQ(logged(), Calls{"A notification is too long for other processes: name"});
}

TEST_F(DeviceDistributedNotificationCenterTest, WithoutAFolderAProcessHearsItsOwn) {
    test::writeTestFile(folder(), "in the way");
    const auto center = makeCenter();
    const auto first = center->addObserverForName(name(), recording("first"));
    const auto second = center->addObserverForName(name(), recording("second"));
    EXPECT_EQ(logged(), Calls{"/run/nimbra/notifications: cannot be made: Not a directory"});

    center->postNotification({.name = name()});
    queue().pump();

    EXPECT_EQ(calls(), (Calls{"first", "second"}));
    EXPECT_EQ(test::contentOf(folder()), "in the way");
}

TEST_F(DeviceDistributedNotificationCenterTest, ADeviceMayHaveALongPath) {
    const auto deep = root() / std::string(150, 'd') / std::string(150, 'e');
    std::filesystem::create_directories(deep);
    Awaited observer;
    Center stranger(DevicePaths(deep), log());
    const auto token = stranger.addObserverForName(name(), observer.observation());

    Center(DevicePaths(deep), log()).postNotification({.name = name()});

    EXPECT_EQ(observer.first().name, name());
    stranger.finish();
    EXPECT_EQ(logged(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, AnObservationWithoutAQueueIsLoggedAndNotCalled) {
    const auto center = makeCenter();
    bool called = false;

    const auto token = center->addObserverForName(
        name(), {.usingBlock = [&called](const Notification&) { called = true; }});
    center->postNotification({.name = name()});
    center->removeObserver(token);

    EXPECT_FALSE(called);
    EXPECT_EQ(logged(), Calls{"An observation has no queue; notification: name"});
}

TEST_F(DeviceDistributedNotificationCenterTest, TheEndLetsTheBlocksGoAndIsForGood) {
    const auto center = makeCenter();
    const auto held = std::make_shared<int>(0);
    const auto counting = [this, &held] {
        return NotificationCenter::Observation{
            .queue = &queue(), .usingBlock = [held](const Notification&) { ++*held; }};
    };
    static_cast<void>(center->addObserverForName(name(), counting()));
    center->postNotification({.name = name()});

    center->finish();
    EXPECT_EQ(held.use_count(), 1);
    static_cast<void>(center->addObserverForName(name(), counting()));
    center->postNotification({.name = name()});
    queue().pump();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(*held, 0);
    EXPECT_EQ(sockets(), Calls{});
}

TEST_F(DeviceDistributedNotificationCenterTest, ManyThreadsMayPostWhileObserversComeAndGo) {
    constexpr int rounds = 50;
    Center one(DevicePaths(root()), log());
    Center two(DevicePaths(root()), log());
    std::atomic<int> own = 0;
    const auto observation = [this, &own] {
        return NotificationCenter::Observation{
            .queue = &queue(), .usingBlock = [&own](const Notification&) { ++own; }};
    };
    const auto kept = one.addObserverForName(name(), observation());
    const auto post = [&one] {
        for (int round = 0; round < rounds; ++round) {
            one.postNotification({.name = name()});
        }
    };
    const auto comeAndGo = [&two, &observation] {
        for (int round = 0; round < rounds; ++round) {
            two.removeObserver(two.addObserverForName(NotificationName("other"), observation()));
        }
    };

    test::runAtOnce({post, post, comeAndGo});
    two.finish();
    queue().pump();

    EXPECT_EQ(own, 2 * rounds);
    EXPECT_EQ(logged(), Calls{});
}

} // namespace
} // namespace nimbra::device
