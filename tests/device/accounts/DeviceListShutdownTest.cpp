#include "device/system/CurrentQueue.h"
#include "device/system/DeviceWorkQueues.h"
#include "tests/device/accounts/DeviceListFixture.h"

#include <atomic>
#include <future>

namespace nimbra::test {
namespace {

using std::chrono::seconds;

using DeviceListShutdownTest = DeviceListFixture;

TEST_F(DeviceListShutdownTest, AHandlerThatIsNeverCalledIsKeptUntilTheEnd) {
    const auto held = std::make_shared<int>();
    write(R"({"outcome": "never answers"})");
    ask(held);
    pump();
    advance(seconds(1'000'000));
    write("{}");
    pump();
    EXPECT_EQ(held.use_count(), 2);
    EXPECT_EQ(queues.time->nextDeadline(), std::nullopt);

    service->finish();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(account.use_count(), 1);
    EXPECT_TRUE(answers.empty());
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListShutdownTest, AnAnswerWhoseTimeHasNotComeIsDroppedAtTheEnd) {
    const auto held = std::make_shared<int>();
    write(R"({"delay": 5})");
    ask(held);
    pump();
    EXPECT_NE(queues.time->nextDeadline(), std::nullopt);

    service->finish();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(queues.time->nextDeadline(), std::nullopt);
    advance(seconds(10));
    EXPECT_TRUE(answers.empty());
}

TEST_F(DeviceListShutdownTest, AnAnswerThatIsDueAndHasNotBegunIsDroppedAtTheEnd) {
    const auto held = std::make_shared<int>();
    write(R"({"delay": 5})");
    ask(held);
    pump();
    queues.time->advance(seconds(5));

    service->finish();
    pump();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_TRUE(answers.empty());
}

TEST_F(DeviceListShutdownTest, AQuestionThatTheQueueHasNotSeenIsDroppedAtTheEnd) {
    const auto held = std::make_shared<int>();
    write("not read any more");
    ask(held);

    service->finish();
    EXPECT_EQ(held.use_count(), 1);
    pump();

    EXPECT_TRUE(answers.empty());
    EXPECT_TRUE(log.lines().empty());
}

TEST_F(DeviceListShutdownTest, AfterTheEndAQuestionIsLetGoAtOnce) {
    const auto held = std::make_shared<int>();
    const auto request = service->initWithAccount(account);
    service->finish();

    request->performRequestWithHandler(noting(held));
    service.reset();
    request->performRequestWithHandler(noting(held));

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_TRUE(queues.queues.empty());
}

TEST_F(DeviceListShutdownTest, WhatAHandlerHoldsMayAskWhenItGoes) {
    struct Farewell {
        explicit Farewell(std::shared_ptr<DeviceListRequest> lastRequest)
            : request(std::move(lastRequest)) {}
        Farewell(const Farewell&) = delete;
        Farewell& operator=(const Farewell&) = delete;
        ~Farewell() {
            request->performRequestWithHandler([](const auto&, const auto&) { FAIL(); });
        }
        std::shared_ptr<DeviceListRequest> request;
    };
    write(R"({"outcome": "never answers"})");
    service->initWithAccount(account)->performRequestWithHandler(
        [farewell = std::make_shared<Farewell>(service->initWithAccount(account))](
            const auto&, const auto&) { FAIL(); });
    pump();

    service.reset();
    pump();

    EXPECT_EQ(account.use_count(), 1);
}

/// Notes on which queue it goes.
class Witness {
public:
    explicit Witness(std::promise<std::string>& place) : _place(place) {}
    Witness(const Witness&) = delete;
    Witness& operator=(const Witness&) = delete;
    ~Witness() { _place.set_value(device::currentQueueLabel()); }

private:
    std::promise<std::string>& _place;
};

/// The same over the platform's own threads.
struct DeviceListThreadsTest : DeviceListFixture {
    DeviceListThreadsTest() {
        service.emplace(device::DeviceListFile(device::DevicePaths(directory.path()), log),
                        threads);
    }

    PumpedQueue mainQueue{"main"};
    device::DeviceWorkQueues threads{mainQueue};
};

TEST_F(DeviceListThreadsTest, AHandlerIsCalledAndLetGoOnTheQueuesThread) {
    std::promise<std::string> called;
    std::promise<std::string> gone;
    service->initWithAccount(account)->performRequestWithHandler(
        [&called, witness = std::make_unique<Witness>(gone)](const auto&, const auto&) {
            called.set_value(device::currentQueueLabel());
        });

    EXPECT_EQ(called.get_future().get(), "device-list");
    EXPECT_EQ(gone.get_future().get(), "device-list");
}

TEST_F(DeviceListThreadsTest, ADelayedAnswerComesOnTheQueuesThread) {
    write(R"({"delay": 0.001})");
    std::promise<std::string> called;
    service->initWithAccount(account)->performRequestWithHandler(
        [&called](const auto&, const auto&) { called.set_value(device::currentQueueLabel()); });

    EXPECT_EQ(called.get_future().get(), "device-list");
}

TEST_F(DeviceListThreadsTest, AHandlerThatRunsAtTheEndRunsOnAndTheOthersGoWithTheCaller) {
    std::promise<void> began;
    std::promise<void> mayEnd;
    std::promise<std::string> placeOfFirst;
    std::promise<std::string> placeOfSecond;
    service->initWithAccount(account)->performRequestWithHandler(
        [&, witness = std::make_unique<Witness>(placeOfFirst)](const auto&, const auto&) {
            began.set_value();
            mayEnd.get_future().wait();
        });
    service->initWithAccount(account)->performRequestWithHandler(
        [witness = std::make_unique<Witness>(placeOfSecond)](const auto&, const auto&) { FAIL(); });
    began.get_future().wait();

    service->finish();

    const auto second = placeOfSecond.get_future();
    EXPECT_EQ(second.wait_for(seconds(0)), std::future_status::ready);
    mayEnd.set_value();
    threads.finish();
    EXPECT_EQ(placeOfFirst.get_future().get(), "device-list");
}

TEST_F(DeviceListThreadsTest, AnEndAmidManyQuestionsLeavesNothingAndAnswersNoneTwice) {
    constexpr int questions = 500;
    const auto held = std::make_shared<int>();
    std::vector<std::atomic<int>> calls(questions);
    write(R"({"incompatible": ["a"]})");
    for (auto& count : calls) {
        service->initWithAccount(account)->performRequestWithHandler(
            [held, &count](const auto&, const auto&) { ++count; });
    }
    write(R"({"delay": 0.001})");

    service->finish();
    threads.finish();

    EXPECT_EQ(held.use_count(), 1);
    EXPECT_EQ(account.use_count(), 1);
    for (const auto& count : calls) {
        EXPECT_LE(count, 1);
    }
}

} // namespace
} // namespace nimbra::test
