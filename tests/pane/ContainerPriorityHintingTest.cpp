#include "tests/pane/PaneFixture.h"

namespace nimbra::test {
namespace {

const char* const kQueueLabel = "container-priority-hinting";

struct ContainerPriorityHintingTest : PaneFixture {
    ContainerPriorityHintingTest() {
        platform.documentContainers.listed = {{.identifier = "first"}, {.identifier = "second"}};
    }

    void pumpHinting() { platform.workQueues.queueLabelled(kQueueLabel)->pump(); }
    void postChange() {
        platform.notificationCenter.postNotification(
            {.name = TidewaterIdentityDidChangeNotification});
        platform.notificationCenter.postNotification(
            {.name = MRContainerListDidChangeNotification});
    }
    [[nodiscard]] const std::vector<std::string>& calls() const {
        return platform.documentContainers.calls;
    }
};

TEST_F(ContainerPriorityHintingTest, AppearingRegistersTheProcessOnTheHintingQueue) {
    pane->viewDidAppear(true);
    EXPECT_EQ(calls(), Calls());

    pumpHinting();

    EXPECT_EQ(calls(), Calls({"register first", "register second"}));
}

TEST_F(ContainerPriorityHintingTest, WithoutAnIdentityNothingIsRegisteredOrEvenListed) {
    platform.fileManager.identity = Text();

    pane->viewDidAppear(true);
    pumpHinting();

    EXPECT_EQ(calls(), Calls());
    EXPECT_EQ(platform.documentContainers.enumerations, 0);
}

TEST_F(ContainerPriorityHintingTest, OnlyPublicContainersAreRegistered) {
    platform.documentContainers.listed = {{.identifier = "hidden", .isPublic = false},
                                          {.identifier = "shown"}};

    pane->viewDidAppear(true);
    pumpHinting();

    EXPECT_EQ(calls(), Calls({"register shown"}));
}

TEST_F(ContainerPriorityHintingTest, AContainerThatFailsDoesNotStopTheOthers) {
    platform.documentContainers.listed = {{.identifier = "broken", .registrationFails = true},
                                          {.identifier = "sound"}};

    pane->viewDidAppear(true);
    pumpHinting();

    EXPECT_EQ(calls(), Calls({"register broken", "register sound"}));
}

TEST_F(ContainerPriorityHintingTest, EachChangeAsksForARegistration) {
    pane->viewDidAppear(true);
    pumpHinting();

    platform.notificationCenter.postNotification({.name = TidewaterIdentityDidChangeNotification});
    pumpHinting();
    platform.notificationCenter.postNotification({.name = MRContainerListDidChangeNotification});
    pumpHinting();

    EXPECT_EQ(platform.documentContainers.enumerations, 3);
}

TEST_F(ContainerPriorityHintingTest, ChangesThatComeBeforeTheRunShareIt) {
    pane->viewDidAppear(true);
    pumpHinting();

    postChange();
    postChange();
    pumpHinting();

    EXPECT_EQ(platform.documentContainers.enumerations, 2);
}

TEST_F(ContainerPriorityHintingTest, ChangesThatComeDuringARunShareOneMore) {
    pane->viewDidAppear(true);
    pumpHinting();
    platform.documentContainers.onEnumeration = [this] {
        platform.documentContainers.onEnumeration = nullptr;
        postChange();
    };

    platform.notificationCenter.postNotification({.name = TidewaterIdentityDidChangeNotification});
    pumpHinting();

    EXPECT_EQ(platform.documentContainers.enumerations, 3);
}

TEST_F(ContainerPriorityHintingTest, DisappearingTakesTheRegistrationBackAfterItWasMade) {
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);

    pumpHinting();

    EXPECT_EQ(calls(), Calls({"register first", "register second", "unregister"}));
}

TEST_F(ContainerPriorityHintingTest, DisappearingBeforeTheFirstAppearanceTakesNothingBack) {
    pane->viewDidDisappear(true);

    EXPECT_EQ(platform.workQueues.queueCount(), 0U);
    EXPECT_EQ(calls(), Calls());
}

TEST_F(ContainerPriorityHintingTest, WhileHiddenChangesAskForNothing) {
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);
    pumpHinting();
    platform.documentContainers.calls.clear();

    postChange();
    pumpHinting();

    EXPECT_EQ(calls(), Calls());
}

TEST_F(ContainerPriorityHintingTest, AppearingAgainUsesTheSameQueueAndSource) {
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);
    pumpHinting();

    pane->viewDidAppear(true);
    pumpHinting();

    EXPECT_EQ(platform.workQueues.queueCount(), 1U);
    EXPECT_EQ(calls(), Calls({"register first", "register second", "unregister", "register first",
                              "register second"}));
}

TEST_F(ContainerPriorityHintingTest, ThePaneMayGoWhileARunIsQueued) {
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);

    pane.reset();
    pumpHinting();

    EXPECT_EQ(calls(), Calls({"unregister"}));
}

TEST_F(ContainerPriorityHintingTest, ThePaneKeepsItsQueueUntilItGoes) {
    pane->viewDidAppear(true);
    pane->viewDidDisappear(true);
    pumpHinting();
    const auto queue = platform.workQueues.queueLabelled(kQueueLabel);
    // The platform's hold and this one.
    constexpr int others = 2;
    EXPECT_GT(queue.use_count(), others);

    pane.reset();

    EXPECT_EQ(queue.use_count(), others);
}

} // namespace
} // namespace nimbra::test
