#include "device/system/StandingTime.h"

#include "device/system/DeviceClock.h"

#include <gtest/gtest.h>
#include <memory>
#include <optional>

namespace nimbra::device {
namespace {

using std::chrono::microseconds;
using std::chrono::nanoseconds;
using std::chrono::seconds;

class StandingTimeTest : public testing::Test {
protected:
    StandingTimeTest() {
        _time->setWake([this] { ++_wakes; });
    }

    [[nodiscard]] static Date start() { return Date(seconds(1'000'000)); }
    [[nodiscard]] StandingTime& time() { return *_time; }
    [[nodiscard]] std::shared_ptr<StandingTime> shared() { return _time; }
    [[nodiscard]] int wakes() const { return _wakes; }

private:
    std::shared_ptr<StandingTime> _time = std::make_shared<StandingTime>(start());
    int _wakes = 0;
};

TEST_F(StandingTimeTest, ItStandsAtItsStartUntilItIsToldToMove) {
    EXPECT_EQ(time().elapsed(), nanoseconds(0));
    EXPECT_EQ(time().now(), start());

    time().advance(seconds(90));
    time().advance(microseconds(1));

    EXPECT_EQ(time().elapsed(), seconds(90) + microseconds(1));
    EXPECT_EQ(time().now(), start() + seconds(90) + microseconds(1));
}

TEST_F(StandingTimeTest, ItNeverGoesBack) {
    time().advanceTo(seconds(10));

    time().advanceTo(seconds(5));
    time().advance(seconds(-1));

    EXPECT_EQ(time().elapsed(), seconds(10));
}

TEST_F(StandingTimeTest, ItWakesWhenTheDeadlineIsReachedAndNotBefore) {
    EXPECT_TRUE(time().wakeAt(seconds(10)));

    time().advance(seconds(10) - nanoseconds(1));
    EXPECT_EQ(wakes(), 0);
    time().advance(nanoseconds(1));

    EXPECT_EQ(wakes(), 1);
}

TEST_F(StandingTimeTest, ItTellsTheDeadlineThatIsSet) {
    EXPECT_EQ(time().nextDeadline(), std::nullopt);

    EXPECT_TRUE(time().wakeAt(seconds(10)));
    EXPECT_TRUE(time().wakeAt(seconds(20)));
    EXPECT_EQ(time().nextDeadline(), seconds(20));

    EXPECT_TRUE(time().wakeAt(std::nullopt));
    EXPECT_EQ(time().nextDeadline(), std::nullopt);
    time().advance(seconds(30));
    EXPECT_EQ(wakes(), 0);
}

TEST_F(StandingTimeTest, ADeadlineThatHasComeAlreadyIsRefused) {
    time().advance(seconds(10));

    EXPECT_FALSE(time().wakeAt(seconds(10)));

    EXPECT_EQ(wakes(), 0);
}

TEST_F(StandingTimeTest, NobodyIsWokenOnceThatIsEnded) {
    EXPECT_TRUE(time().wakeAt(seconds(10)));

    time().setWake({});
    time().advance(seconds(10));

    EXPECT_EQ(wakes(), 0);
}

TEST_F(StandingTimeTest, TheClockShowsItsDate) {
    const DeviceClock clock(shared());
    EXPECT_EQ(clock.now(), start());

    time().advance(seconds(5));

    EXPECT_EQ(clock.now(), start() + seconds(5));
}

} // namespace
} // namespace nimbra::device
