#include "footer/LastSyncTimer.h"
#include "tests/footer/FooterFixture.h"

#include <utility>

namespace nimbra::test {
namespace {

using namespace std::chrono_literals;

struct FooterTimer : FooterFixture {
    /// What the timer was asked when the view came into a window, a sync of this age done.
    [[nodiscard]] Calls callsForAge(Date::duration age) {
        storeAge(age);
        view->moveToWindow(&window);
        return timer().calls;
    }

    [[nodiscard]] static std::string arm(int first) {
        return "arm " + std::to_string(static_cast<double>(first)) + "/60.000000";
    }
};

TEST_F(FooterTimer, ASyncOfThisMinuteIsRefreshedAfterSixtySeconds) {
    EXPECT_EQ(callsForAge(0s), (Calls{arm(60), "resume"}));
    EXPECT_EQ(timer().leeway, 0ns);
    EXPECT_TRUE(isAutoUpdating());
}

TEST_F(FooterTimer, ASyncThirtySecondsAgoIsRefreshedAfterSixtySeconds) {
    EXPECT_EQ(callsForAge(30s), (Calls{arm(60), "resume"}));
}

TEST_F(FooterTimer, ASyncTwoMinutesAndTenSecondsAgoIsRefreshedAfterTwoSeconds) {
    EXPECT_EQ(callsForAge(130s), (Calls{arm(2), "resume"}));
}

TEST_F(FooterTimer, TheMinutesOfTheAgeAreTheSecondsOfTheDelay) {
    const std::pair<Date::duration, int> rows[] = {
        {0s, 60},   {59s, 60},     {59'999'999us, 60}, {60s, 1},    {61s, 1},       {119s, 1},
        {120s, 2},  {3599s, 59},   {3600s, 60},        {3659s, 60}, {3660s, 1},     {7200s, 60},
        {7380s, 3}, {86'400s, 60}, {86'460s, 1},       {-1s, 60},   {-86'400s, 60},
    };
    for (const auto& [age, seconds] : rows) {
        const auto delay = firstDelay(secondsSince(now - age, now));
        EXPECT_EQ(delay, std::chrono::seconds(seconds)) << age.count() << " us";
    }
}

TEST_F(FooterTimer, DatesAsFarApartAsTheyComeHaveADelay) {
    EXPECT_EQ(secondsSince(Date::min(), Date::max()), 18'446'744'073'709U);
    EXPECT_EQ(secondsSince(Date::max(), Date::min()), 0U);
}

TEST_F(FooterTimer, ADateInTheFutureCountsAsNow) {
    EXPECT_EQ(callsForAge(-1h), (Calls{arm(60), "resume"}));
}

TEST_F(FooterTimer, ARunningTimerIsOnlyArmedAnew) {
    static_cast<void>(callsForAge(61s));
    timer().calls.clear();

    postLastSync({{MRSyncStatusLastSyncDateKey, now - 5min}});

    EXPECT_EQ(timer().calls, Calls{arm(5)});
    EXPECT_TRUE(isAutoUpdating());
}

TEST_F(FooterTimer, AFiringRefreshesTheSentenceAndDoesNotArm) {
    static_cast<void>(callsForAge(61s));
    timer().calls.clear();
    static_cast<void>(takeCalls());
    platform.lastSync.sentence = Text("Synced a minute ago.");

    timer().fire();

    EXPECT_EQ(text(), Text("Synced a minute ago."));
    EXPECT_EQ(takeCalls(), Calls{"sentence"});
    EXPECT_EQ(timer().calls, Calls());
}

TEST_F(FooterTimer, AFiringChangesNothingWhileSyncing) {
    static_cast<void>(callsForAge(61s));
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));
    static_cast<void>(takeCalls());

    timer().fire();

    EXPECT_EQ(text(), Text("Uploading"));
    EXPECT_EQ(takeCalls(), Calls());
    end();
}

TEST_F(FooterTimer, AMissingSentenceSuspendsARunningTimerOnce) {
    static_cast<void>(callsForAge(61s));
    timer().calls.clear();
    platform.lastSync.sentence = Text();

    timer().fire();
    EXPECT_EQ(timer().calls, Calls{"suspend"});
    EXPECT_FALSE(text());
    EXPECT_FALSE(isAutoUpdating());

    postLastSync({});
    EXPECT_EQ(timer().calls, Calls{"suspend"}) << "a second missing sentence suspends nothing";
}

TEST_F(FooterTimer, ADateArmsNothingWhileThereIsNoSentence) {
    platform.lastSync.sentence = Text();

    EXPECT_EQ(callsForAge(61s), Calls());
    EXPECT_FALSE(text());
    EXPECT_FALSE(isAutoUpdating());

    postLastSync({{MRSyncStatusLastSyncDateKey, now}});
    EXPECT_EQ(timer().calls, Calls());
}

TEST_F(FooterTimer, ASuspendedTimerRunsAgainWhenASentenceAndADateCome) {
    static_cast<void>(callsForAge(61s));
    platform.lastSync.sentence = Text();
    timer().fire();
    timer().calls.clear();
    platform.lastSync.sentence = Text("Synced.");

    postLastSync({{MRSyncStatusLastSyncDateKey, now}});

    EXPECT_EQ(timer().calls, (Calls{arm(60), "resume"}));
    EXPECT_TRUE(isAutoUpdating());
}

TEST_F(FooterTimer, AnEmptySentenceIsASentence) {
    platform.lastSync.sentence = Text("");

    EXPECT_EQ(callsForAge(61s), (Calls{arm(1), "resume"}));
    EXPECT_EQ(text(), Text(""));
}

TEST_F(FooterTimer, ASentenceThatCannotBeFetchedLeavesTextAndTimer) {
    static_cast<void>(callsForAge(61s));
    timer().calls.clear();
    platform.lastSync.sentence =
        std::unexpected(Error{.domain = "daemon", .code = 4, .description = "no answer"});

    timer().fire();

    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_EQ(timer().calls, Calls());
    EXPECT_TRUE(isAutoUpdating());
    const FakeSystemLog::Lines expected{
        {LogLevel::error, "can't fetch last sync; no answer (daemon 4)"}};
    EXPECT_EQ(platform.systemLog.lines, expected);
}

TEST_F(FooterTimer, ASentenceThatCannotBeFetchedStillLetsADateArmTheTimer) {
    platform.lastSync.sentence =
        std::unexpected(Error{.domain = "daemon", .code = 4, .description = "no answer"});

    EXPECT_EQ(callsForAge(61s), (Calls{arm(1), "resume"})) << "the four blanks are a text";
    EXPECT_EQ(text(), Text("    "));
}

TEST_F(FooterTimer, ASentenceThatCannotBeFetchedUnderAnEmptyTextArmsNothing) {
    platform.lastSync.sentence = Text();
    ASSERT_EQ(callsForAge(61s), Calls());
    platform.lastSync.sentence =
        std::unexpected(Error{.domain = "daemon", .code = 4, .description = "no answer"});

    postLastSync({{MRSyncStatusLastSyncDateKey, now}});

    EXPECT_EQ(timer().calls, Calls());
    EXPECT_FALSE(text());
    EXPECT_FALSE(isAutoUpdating());
}

} // namespace
} // namespace nimbra::test
