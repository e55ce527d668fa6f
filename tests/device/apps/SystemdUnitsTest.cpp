#include "device/apps/SystemdUnits.h"

#include "tests/device/apps/ManagerStandIn.h"
#include "tests/support/PrivateBus.h"

#include <chrono>
#include <functional>
#include <future>
#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::device {
namespace {

using test::ManagerStandIn;
using Lines = std::vector<std::string>;
using Manner = ManagerStandIn::Manner;
constexpr std::chrono::milliseconds atOnce(0);
constexpr std::chrono::hours ages(24);
const std::string notesUnit = "app-gnome-org.example.Notes-4711.scope";

class SystemdUnitsTest : public testing::Test {
protected:
    [[nodiscard]] std::unique_ptr<EndingApplication> askNotes() {
        return _units.askToEnd(BundleIdentifier("org.example.Notes"));
    }
    [[nodiscard]] test::PrivateBus& bus() { return _bus; }

    /// Expects that who waits for a unit that ignores TERM learns of its end by `change`.
    void expectEndBy(const std::function<void(ManagerStandIn& manager)>& change) {
        ManagerStandIn manager;
        manager.start(notesUnit, Manner::ignoresTerm);
        const auto ending = askNotes();
        ASSERT_TRUE(ending);

        auto ended = std::async(std::launch::async, [&] { return ending->awaitEnd(ages); });
        // Asked for once to find it, and once more to see that it still runs.
        manager.awaitLists(2);
        change(manager);

        EXPECT_TRUE(ended.get());
    }

private:
    test::PrivateBus _bus;
    SystemdUnits _units;
};

TEST_F(SystemdUnitsTest, EveryUnitOfTheApplicationIsAskedAndNoOther) {
    ManagerStandIn manager;
    for (const char* const unit :
         {"app-gnome-org.example.Notes-4711.scope", "app-org.example.Notes@x.service",
          "app-org.example.Notes2-1.scope", "app-org.example.Clock-2.scope",
          "org.example.Notes.service"}) {
        manager.start(unit);
    }

    const auto ending = askNotes();

    ASSERT_TRUE(ending);
    EXPECT_TRUE(ending->awaitEnd(ages));
    EXPECT_EQ(manager.sent(), (Lines{"app-gnome-org.example.Notes-4711.scope TERM",
                                     "app-org.example.Notes@x.service TERM"}));
}

TEST_F(SystemdUnitsTest, TheEndOfAUnitIsWaitedFor) {
    expectEndBy([](ManagerStandIn& manager) { manager.end(notesUnit); });
}

TEST_F(SystemdUnitsTest, AUnitThatFailsHasEnded) {
    expectEndBy([](ManagerStandIn& manager) { manager.fail(notesUnit); });
}

TEST_F(SystemdUnitsTest, AUnitThatDoesNotListenIsKilled) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::ignoresTerm);
    const auto ending = askNotes();
    ASSERT_TRUE(ending);
    EXPECT_FALSE(ending->awaitEnd(atOnce));

    ending->kill();

    EXPECT_TRUE(ending->awaitEnd(ages));
    EXPECT_EQ(manager.sent(), (Lines{notesUnit + " TERM", notesUnit + " KILL"}));
}

TEST_F(SystemdUnitsTest, AUnitOfAManagerThatDoesNotAnswerForAWhileIsKilled) {
    for (const char* const error :
         {"org.freedesktop.DBus.Error.Timeout", "org.freedesktop.DBus.Error.NoReply"}) {
        ManagerStandIn manager;
        manager.start(notesUnit, Manner::ignoresTerm);
        const auto ending = askNotes();
        ASSERT_TRUE(ending);
        manager.refuse("ListUnitsByPatterns", error);

        EXPECT_FALSE(ending->awaitEnd(atOnce)) << error;
        ending->kill();

        EXPECT_EQ(manager.sent(), (Lines{notesUnit + " TERM", notesUnit + " KILL"}));
    }
}

TEST_F(SystemdUnitsTest, WhatTheApplicationStartsInMeanwhileIsLeftAlone) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::ignoresTerm);
    const auto ending = askNotes();
    ASSERT_TRUE(ending);
    manager.start("app-gnome-org.example.Notes-4712.scope");

    ending->kill();

    EXPECT_TRUE(ending->awaitEnd(ages));
    EXPECT_EQ(manager.sent(), (Lines{notesUnit + " TERM", notesUnit + " KILL"}));
}

TEST_F(SystemdUnitsTest, AUnitThatIsStartedAnewUnderTheSameNameIsLeftAlone) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::ignoresTerm);
    const auto ending = askNotes();
    ASSERT_TRUE(ending);
    EXPECT_FALSE(ending->awaitEnd(atOnce));
    manager.end(notesUnit);
    manager.start(notesUnit, Manner::ignoresTerm);

    ending->kill();

    EXPECT_TRUE(ending->awaitEnd(ages));
    EXPECT_EQ(manager.sent(), Lines{notesUnit + " TERM"});
}

TEST_F(SystemdUnitsTest, TheUnitThatHoldsThisProcessIsLeftAlone) {
    ManagerStandIn manager;
    manager.start(notesUnit);
    manager.holdThisProcess(notesUnit);

    EXPECT_FALSE(askNotes());
    EXPECT_EQ(manager.sent(), Lines{});
}

TEST_F(SystemdUnitsTest, NothingIsEndedWhereNobodyTellsWhichUnitHoldsThisProcess) {
    for (const char* const error :
         {"org.freedesktop.DBus.Error.Timeout", "org.freedesktop.DBus.Error.AccessDenied"}) {
        ManagerStandIn manager;
        manager.start(notesUnit);
        manager.refuse("GetUnitByPID", error);

        EXPECT_FALSE(askNotes()) << error;
        EXPECT_EQ(manager.sent(), Lines{});
    }
}

TEST_F(SystemdUnitsTest, TheUnitThatHoldsThisProcessIsAskedForOnce) {
    ManagerStandIn manager;
    manager.start(notesUnit);
    manager.start("app-gnome-org.example.Notes-4712.scope");

    EXPECT_TRUE(askNotes());
    EXPECT_EQ(manager.calls("GetUnitByPID"), 1);
}

TEST_F(SystemdUnitsTest, AUnitThatMayNotBeAskedIsNone) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::refuses);

    EXPECT_FALSE(askNotes());
}

TEST_F(SystemdUnitsTest, AUnitThatMayNotBeAskedKeepsNoOtherFromIt) {
    ManagerStandIn manager;
    manager.start("app-aaa-org.example.Notes-1.scope", Manner::refuses);
    manager.start(notesUnit);

    EXPECT_TRUE(askNotes());
    EXPECT_EQ(manager.sent(), Lines{notesUnit + " TERM"});
}

TEST_F(SystemdUnitsTest, AnApplicationWithoutUnitsDoesNotRunThisWay) {
    ManagerStandIn manager;
    manager.start("app-org.example.Clock-2.scope");
    EXPECT_FALSE(askNotes());
}

TEST_F(SystemdUnitsTest, NothingRunsThisWayWithoutAManager) {
    EXPECT_FALSE(askNotes());
}

TEST_F(SystemdUnitsTest, NothingRunsThisWayWithoutABus) {
    bus().end();
    EXPECT_FALSE(askNotes());
}

TEST_F(SystemdUnitsTest, ABusThatCouldNotBeHadIsNotTriedAgainAtOnce) {
    bus().end();
    EXPECT_FALSE(askNotes());
    const test::PrivateBus later;
    ManagerStandIn manager;
    manager.start(notesUnit);

    EXPECT_FALSE(askNotes());

    EXPECT_EQ(manager.calls("ListUnitsByPatterns"), 0);
    EXPECT_TRUE(SystemdUnits().askToEnd(BundleIdentifier("org.example.Notes")));
}

TEST_F(SystemdUnitsTest, NobodyWaitsForAManagerThatHasGone) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::ignoresTerm);
    const auto ending = askNotes();
    ASSERT_TRUE(ending);

    manager.leave();

    EXPECT_TRUE(ending->awaitEnd(ages));
    ending->kill();
    EXPECT_EQ(manager.sent(), Lines{notesUnit + " TERM"});
}

TEST_F(SystemdUnitsTest, NobodyWaitsOnABusThatHasGone) {
    ManagerStandIn manager;
    manager.start(notesUnit, Manner::ignoresTerm);
    const auto ending = askNotes();
    ASSERT_TRUE(ending);

    auto ended = std::async(std::launch::async, [&] { return ending->awaitEnd(ages); });
    manager.awaitLists(2);
    bus().end();

    EXPECT_TRUE(ended.get());
}

} // namespace
} // namespace nimbra::device
