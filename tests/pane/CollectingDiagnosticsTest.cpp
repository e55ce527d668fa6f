#include "tests/pane/DiagnosticsFixture.h"

#include <gmock/gmock.h>

namespace nimbra::test {
namespace {

using testing::ElementsAre;

struct CollectingDiagnostics : DiagnosticsFixture {};

TEST_F(CollectingDiagnostics, ATapMakesThePageBusyAndStartsNothingByItself) {
    Calls before;
    platform.workQueues.globalQueueWithQuality(UserInitiatedQuality).whenQueued = [&] {
        before = platform.calls;
    };

    tap();

    EXPECT_THAT(platform.calls, ElementsAre("task added", "busy: Gathering"));
    EXPECT_EQ(before, platform.calls) << "the page is busy before anything can run";
    EXPECT_TRUE(root->taskIsRunning(pane));
    EXPECT_EQ(platform.workQueues.mainQueue().pendingCount(), 0U);
}

TEST_F(CollectingDiagnostics, TheArchiveIsCollectedInTheBackgroundAndShownOnTheMainQueue) {
    tap();
    EXPECT_THAT(takeCalls(), ElementsAre("task added", "busy: Gathering"));

    collect();
    EXPECT_EQ(takeCalls().back(), "wait for 42");

    pumpMain();
    EXPECT_THAT(takeCalls(), ElementsAre("not busy", "reach " + std::string(kArchive), kShared));
}

TEST_F(CollectingDiagnostics, ACollectionIsOnePieceOfWork) {
    PumpedQueue& background = platform.workQueues.globalQueueWithQuality(UserInitiatedQuality);
    PumpedQueue& mainQueue = platform.workQueues.mainQueue();
    tap();
    EXPECT_EQ(background.pendingCount(), 1U);

    background.pumpOne();

    EXPECT_EQ(platform.calls.back(), "wait for 42");
    EXPECT_EQ(background.pendingCount(), 0U);
    EXPECT_EQ(mainQueue.pendingCount(), 1U);
}

TEST_F(CollectingDiagnostics, TheArchiveIsOfferedInThreeWays) {
    tapAndWait();

    ASSERT_NE(sheet(), nullptr);
    EXPECT_THAT(sheet()->activityItems(), ElementsAre(FileURL(kArchive)));
    ASSERT_TRUE(sheet()->includedActivityTypes());
    EXPECT_THAT(*sheet()->includedActivityTypes(),
                ElementsAre(ActivityType("ActivityTypeMessage"), ActivityType("ActivityTypeMail"),
                            ActivityType("ActivityTypeNearbyTransfer")));
}

TEST_F(CollectingDiagnostics, TheSheetPointsToTheRowsCell) {
    const auto cell = std::make_shared<TableCell>(platform.services(), Rect(), "Diagnose");
    pane->table()->setCellSource(
        [&](const IndexPath& path) { return path == IndexPath{2, 0} ? cell : nullptr; });

    tapAndWait();

    EXPECT_EQ(sheet()->popoverPresentationController().sourceView, cell);
    EXPECT_EQ(platform.calls.back(), kShared + ", from a view");
    EXPECT_THAT(platform.systemLog.lines,
                ElementsAre(std::pair(LogLevel::standard,
                                      "VTUIDocumentsDataViewController: Setting source view of "
                                      "activity VC as <TableCell: Diagnose>.")));
}

TEST_F(CollectingDiagnostics, WithoutACellTheSheetStandsByItself) {
    tapAndWait();

    EXPECT_EQ(sheet()->popoverPresentationController().sourceView, nullptr);
    EXPECT_THAT(platform.systemLog.lines,
                ElementsAre(std::pair(LogLevel::standard,
                                      "VTUIDocumentsDataViewController: Setting source view of "
                                      "activity VC as (null).")));
}

TEST_F(CollectingDiagnostics, ARowThatHasLeftTheListHasNoCell) {
    pane->table()->setCellSource([this](const IndexPath&) {
        return std::make_shared<TableCell>(platform.services(), Rect(), "Other");
    });
    tap();
    collect();
    pane->reloadSpecifiers();
    pumpMain();

    EXPECT_EQ(sheet()->popoverPresentationController().sourceView, nullptr);
}

TEST_F(CollectingDiagnostics, TheSourceOfTheSheetIsLoggedBeforeItIsShown) {
    platform.systemLog.onWrite = [this] { platform.calls.emplace_back("log"); };

    tapAndWait();

    EXPECT_THAT(takeHostCalls(), ElementsAre("task added", "busy: Gathering", "not busy",
                                             "reach " + std::string(kArchive), "log", kShared));
}

TEST_F(CollectingDiagnostics, HoweverTheSheetEndsThePageIsFreeAgain) {
    for (const ShareOutcome outcome :
         {ShareOutcome::sent, ShareOutcome::cancelled, ShareOutcome::failed}) {
        tapAndWait();
        EXPECT_TRUE(root->taskIsRunning(pane));
        platform.calls.clear();

        const auto shown = std::exchange(platform.presenter.shareSheet, nullptr);
        shown->completionWithItemsHandler()(outcome);

        EXPECT_THAT(takeCalls(), ElementsAre("task finished", "dismiss presented, animated"));
        EXPECT_FALSE(root->taskIsRunning(pane));
    }
}

TEST_F(CollectingDiagnostics, TheSheetHoldsThePage) {
    tapAndWait();
    const std::weak_ptr<PaneWithRows> weakPane = pane;
    pane.reset();
    EXPECT_FALSE(weakPane.expired());

    platform.presenter.shareSheet.reset();

    EXPECT_TRUE(weakPane.expired());
}

TEST_F(CollectingDiagnostics, ATapWhileACollectionRunsDoesNothing) {
    tap();
    platform.calls.clear();

    tap();
    EXPECT_THAT(platform.calls, ElementsAre());
    collect();
    tap();
    pumpMain();

    EXPECT_EQ(platform.processes.requests.size(), 1U);
}

TEST_F(CollectingDiagnostics, ATapWhileTheSheetStandsDoesNothing) {
    tapAndWait();
    platform.calls.clear();

    tapAndWait();

    EXPECT_THAT(platform.calls, ElementsAre());
}

TEST_F(CollectingDiagnostics, ATaskOfThePageThatIsNotItsOwnCountsAsWell) {
    root->addTask(pane);
    platform.calls.clear();

    tap();

    EXPECT_THAT(platform.calls, ElementsAre());
}

TEST_F(CollectingDiagnostics, ATaskOfAnotherPageDoesNotCount) {
    const auto other = std::make_shared<PaneWithRows>(platform.services());
    root->addTask(other);
    platform.calls.clear();

    tap();

    EXPECT_THAT(platform.calls, ElementsAre("task added", "busy: Gathering"));
}

TEST_F(CollectingDiagnostics, AFailedToolIsToldAndThePageIsFreeAtOnce) {
    platform.processes.status = 0x0100;

    tapAndWait();

    EXPECT_THAT(takeHostCalls(), ElementsAre("task added", "busy: Gathering", "not busy",
                                             "alert, animated: No archive", "task finished"));
    EXPECT_FALSE(root->taskIsRunning(pane));
    EXPECT_EQ(sheet(), nullptr);
    EXPECT_THAT(platform.systemLog.lines, ElementsAre());
}

TEST_F(CollectingDiagnostics, TheAlertHasOneAnswerThatOnlyClosesIt) {
    platform.processes.spawned = std::unexpected(ENOENT);

    tapAndWait();

    const auto alert = platform.presenter.alert;
    EXPECT_EQ(alert->title(), Text("No archive"));
    EXPECT_EQ(alert->message(), Text("Try again."));
    EXPECT_EQ(alert->preferredStyle(), AlertControllerStyle::alert);
    EXPECT_EQ(platform.presenter.answersOfAlert, 1U) << "before it is shown";
    ASSERT_EQ(alert->actions().size(), 1U);
    EXPECT_EQ(alert->actions().front().title, Text("OK"));
    EXPECT_EQ(alert->actions().front().style, AlertActionStyle::standard);
    EXPECT_FALSE(alert->actions().front().handler);
}

TEST_F(CollectingDiagnostics, AnArchiveThatIsNotThereIsAFailure) {
    platform.fileManager.isReachable = false;

    tapAndWait();

    EXPECT_THAT(takeHostCalls(), ElementsAre("task added", "busy: Gathering", "not busy",
                                             "reach " + std::string(kArchive),
                                             "alert, animated: No archive", "task finished"));
}

TEST_F(CollectingDiagnostics, ADirectoryThatCannotBeMadeIsTheSameFailure) {
    platform.fileManager.createOutcomes = {Error{"disk", 28, "no room"}};

    tapAndWait();

    EXPECT_THAT(platform.processes.requests, ElementsAre());
    EXPECT_EQ(takeHostCalls().back(), "task finished");
}

TEST_F(CollectingDiagnostics, AfterAFailureOneCanTryAgain) {
    platform.processes.status = 0x0100;
    tapAndWait();
    platform.processes.status = 0;

    tapAndWait();

    EXPECT_EQ(platform.processes.requests.size(), 2U);
    EXPECT_NE(sheet(), nullptr);
}

TEST_F(CollectingDiagnostics, WithoutARootControllerACollectionRunsAsIfThePageWereIdle) {
    root.reset();
    tap();
    tap();
    EXPECT_THAT(takeHostCalls(), ElementsAre("busy: Gathering", "busy: Gathering"));
    collect();
    pumpMain();

    sheet()->completionWithItemsHandler()(ShareOutcome::sent);

    EXPECT_EQ(platform.processes.requests.size(), 2U);
    EXPECT_EQ(takeHostCalls().back(), "dismiss presented, animated");
}

TEST_F(CollectingDiagnostics, ARootControllerThatGoesMeanwhileIsToldNothing) {
    const std::weak_ptr<RecordingRoot> weakRoot = root;
    tap();
    root.reset();
    EXPECT_TRUE(weakRoot.expired());
    collect();
    pumpMain();

    sheet()->completionWithItemsHandler()(ShareOutcome::cancelled);

    EXPECT_EQ(takeHostCalls().back(), "dismiss presented, animated");
}

TEST_F(CollectingDiagnostics, ASheetDoesNotHoldTheRootController) {
    const std::weak_ptr<RecordingRoot> weakRoot = root;
    tapAndWait();
    platform.calls.clear();

    root.reset();
    EXPECT_TRUE(weakRoot.expired());
    sheet()->completionWithItemsHandler()(ShareOutcome::cancelled);

    EXPECT_THAT(platform.calls, ElementsAre("dismiss presented, animated"));
}

TEST_F(CollectingDiagnostics, APageThatIsLetGoIsKeptUntilItsCollectionEnds) {
    const std::weak_ptr<PaneWithRows> weakPane = pane;
    platform.processes.status = 0x0100;
    tap();
    pane.reset();

    collect();
    EXPECT_FALSE(weakPane.expired());
    pumpMain();

    EXPECT_TRUE(weakPane.expired());
}

} // namespace
} // namespace nimbra::test
