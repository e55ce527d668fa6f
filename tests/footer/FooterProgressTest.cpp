#include "tests/footer/FooterFixture.h"

#include <syslog.h>

namespace nimbra::test {
namespace {

/// The view in its window.
struct FooterProgress : FooterFixture {
    FooterProgress() {
        view->setFrame({.origin = {}, .size = {320, view->intrinsicContentSize().height}});
        view->moveToWindow(&window);
        view->layoutIfNeeded();
        platform.calls.clear();
    }

    /// The text while a progress with these descriptions is shown.
    [[nodiscard]] Text textFor(Text description, Text additional) {
        const auto progress = progressCalled(std::move(description));
        progress->additional = std::move(additional);
        const auto end = platform.progressReports.publish(progress);
        const Text shown = text();
        end();
        return shown;
    }
};

/// Something that can be observed and is no progress.
class Thing final : public KeyValueObservable {
public:
    void addObserver(const std::shared_ptr<KeyValueObserver>& /*observer*/,
                     const Registration& /*registration*/) override {}
    void removeObserverForKeyPath(const KeyValueObserver& /*observer*/,
                                  const KeyPath& /*keyPath*/) override {}
};

TEST_F(FooterProgress, APublishedProgressShowsBarAndText) {
    const auto progress = progressCalled("Uploading");
    progress->fraction = 0.25;

    const auto end = platform.progressReports.publish(progress);

    EXPECT_TRUE(view->isSyncing());
    EXPECT_FALSE(isBarHidden());
    EXPECT_EQ(view->progressBar()->progress(), 0.25F);
    EXPECT_TRUE(view->progressBar()->isProgressAnimated());
    EXPECT_EQ(text(), Text("Uploading"));
    EXPECT_TRUE(view->needsLayout());
    EXPECT_EQ(takeCalls(), Calls()) << "no sentence is asked for";
    end();
}

TEST_F(FooterProgress, TheThreeValuesAreObservedInTheirOrder) {
    const auto progress = progressCalled("Uploading");

    const auto end = platform.progressReports.publish(progress);
    EXPECT_EQ(progress->calls,
              (Calls{"add localizedDescription 4", "add localizedAdditionalDescription 4",
                     "add fractionCompleted 4"}));
    EXPECT_EQ(progress->contexts, std::vector<void*>(3, nullptr));
    progress->calls.clear();
    end();

    EXPECT_EQ(progress->calls,
              (Calls{"remove localizedDescription", "remove localizedAdditionalDescription",
                     "remove fractionCompleted"}));
}

TEST_F(FooterProgress, TheBarBeginsAtNothingWithoutAMovement) {
    const auto first = progressCalled("Uploading");
    first->fraction = 0.75;
    platform.progressReports.publish(first)();
    ASSERT_EQ(view->progressBar()->progress(), 0.75F);
    const auto second = progressCalled("Uploading");
    second->indeterminate = true;

    const auto end = platform.progressReports.publish(second);

    EXPECT_EQ(view->progressBar()->progress(), 0);
    EXPECT_FALSE(view->progressBar()->isProgressAnimated());
    end();
}

TEST_F(FooterProgress, TheEndOfAProgressHidesTheBarAndShowsTheSentence) {
    const auto end = platform.progressReports.publish(progressCalled("Uploading"));
    view->layoutIfNeeded();

    end();

    EXPECT_FALSE(view->isSyncing());
    EXPECT_TRUE(isBarHidden());
    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_EQ(takeCalls(), Calls{"sentence"});
    EXPECT_TRUE(view->needsLayout());
}

TEST_F(FooterProgress, TheEndOfAProgressComesInItsOrder) {
    const auto progress = progressCalled("Uploading");
    Calls seen;
    const auto note = [&] {
        seen.push_back(std::string(view->isSyncing() ? "syncing" : "idle") +
                       (isBarHidden() ? ", no bar" : ", bar"));
    };
    progress->whenRemoved = note;
    platform.lastSync.whenAsked = note;

    platform.progressReports.publish(progress)();

    EXPECT_EQ(seen, (Calls{"syncing, bar", "syncing, bar", "syncing, bar", "idle, no bar"}));
}

TEST_F(FooterProgress, AProgressThatBeginsIndeterminateShowsTheSentenceBehindTheBarsEnd) {
    const auto progress = progressCalled("Uploading");
    progress->indeterminate = true;
    std::vector<bool> hidden;
    platform.lastSync.whenAsked = [&] { hidden.push_back(isBarHidden()); };

    const auto end = platform.progressReports.publish(progress);

    EXPECT_EQ(hidden, std::vector<bool>{true});
    EXPECT_EQ(text(), Text("Synced."));
    end();
}

TEST_F(FooterProgress, TheEndHoldsProgressAndView) {
    auto progress = progressCalled("Uploading");
    const std::weak_ptr<FakeProgress> heldProgress = progress;
    auto end = platform.progressReports.publish(std::exchange(progress, nullptr));
    timer().setEventHandler({});
    platform.progressReports.finish();
    platform.distributedNotificationCenter.registrations.clear();
    const std::weak_ptr<View> heldView = view;

    view.reset();

    EXPECT_FALSE(heldProgress.expired());
    EXPECT_FALSE(heldView.expired());
    end = {};
    EXPECT_TRUE(heldProgress.expired());
    EXPECT_TRUE(heldView.expired());
}

TEST_F(FooterProgress, AChangeOfTheFractionAloneAsksForALayout) {
    const auto progress = progressCalled("Uploading");
    const auto end = platform.progressReports.publish(progress);
    view->layoutIfNeeded();
    progress->fraction = 0.5;

    progress->tell(fractionCompletedKeyPath);

    EXPECT_TRUE(view->needsLayout());
    end();
}

TEST_F(FooterProgress, AnEndThatChangesNoTextAsksForALayout) {
    const auto end = platform.progressReports.publish(progressCalled("Synced."));
    view->layoutIfNeeded();

    end();

    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_TRUE(view->needsLayout());
}

TEST_F(FooterProgress, AFileOperationIsNotShown) {
    const auto progress = progressCalled("Copying");
    progress->info = {{ProgressFileOperationKindKey, Text("copying")}};

    const auto end = platform.progressReports.publish(progress);
    end();

    EXPECT_EQ(text(), Text("    "));
    EXPECT_TRUE(isBarHidden());
    EXPECT_FALSE(view->isSyncing());
    EXPECT_EQ(progress->calls, Calls());
    EXPECT_EQ(takeCalls(), Calls());
    EXPECT_FALSE(view->needsLayout());
}

TEST_F(FooterProgress, TheEndOfAFileOperationLeavesTheSyncShown) {
    const auto copying = progressCalled("Copying");
    copying->info = {{ProgressFileOperationKindKey, Text("copying")}};
    const auto endOfSync = platform.progressReports.publish(progressCalled("Uploading"));
    const auto endOfCopying = platform.progressReports.publish(copying);

    endOfCopying();

    EXPECT_TRUE(view->isSyncing());
    EXPECT_FALSE(isBarHidden());
    EXPECT_EQ(text(), Text("Uploading"));
    endOfSync();
}

TEST_F(FooterProgress, AnAdditionalDescriptionStandsInParentheses) {
    EXPECT_EQ(textFor("Uploading 3 items", "2 MB of 5 MB"),
              Text("Uploading 3 items (2 MB of 5 MB)"));
}

TEST_F(FooterProgress, ADescriptionStandsAloneWithoutAnAdditionalOne) {
    EXPECT_EQ(textFor("Uploading", ""), Text("Uploading"));
    EXPECT_EQ(textFor("Uploading", Text()), Text("Uploading"));
}

TEST_F(FooterProgress, AnAdditionalDescriptionNeverStandsAlone) {
    EXPECT_EQ(textFor("", "2 MB of 5 MB"), Text(""));
    EXPECT_EQ(textFor(Text(), "2 MB of 5 MB"), Text());
    EXPECT_EQ(textFor(Text(), Text()), Text());
}

TEST_F(FooterProgress, AnyOfTheValuesRefreshesAll) {
    const auto progress = progressCalled("Uploading");
    const auto end = platform.progressReports.publish(progress);

    for (const KeyPath& keyPath :
         {localizedDescriptionKeyPath, localizedAdditionalDescriptionKeyPath,
          fractionCompletedKeyPath}) {
        progress->fraction += 0.25;
        progress->description = keyPath.string();
        progress->additional = "more";
        view->layoutIfNeeded();

        progress->tell(keyPath);

        EXPECT_EQ(text(), Text(keyPath.string() + " (more)"));
        EXPECT_EQ(view->progressBar()->progress(), static_cast<float>(progress->fraction));
        EXPECT_TRUE(view->needsLayout());
    }
    end();
}

TEST_F(FooterProgress, AnIndeterminateProgressShowsTheSentenceInsteadOfTheBar) {
    const auto progress = progressCalled("Uploading");
    const auto end = platform.progressReports.publish(progress);
    view->layoutIfNeeded();
    progress->indeterminate = true;

    progress->tell(fractionCompletedKeyPath);

    EXPECT_TRUE(isBarHidden());
    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_TRUE(view->isSyncing());
    EXPECT_TRUE(view->needsLayout());
    end();
}

TEST_F(FooterProgress, ASecondIndeterminateChangeShowsNothingNew) {
    const auto progress = progressCalled("Uploading");
    const auto end = platform.progressReports.publish(progress);
    progress->indeterminate = true;
    progress->tell(fractionCompletedKeyPath);
    platform.lastSync.sentence = Text("Synced later.");
    view->layoutIfNeeded();
    static_cast<void>(takeCalls());

    progress->tell(fractionCompletedKeyPath);

    EXPECT_TRUE(isBarHidden());
    EXPECT_EQ(text(), Text("Synced."));
    EXPECT_EQ(takeCalls(), Calls());
    EXPECT_TRUE(view->needsLayout());
    end();
}

TEST_F(FooterProgress, ADeterminateProgressBringsTheBarBack) {
    const auto progress = progressCalled("Uploading");
    progress->indeterminate = true;
    const auto end = platform.progressReports.publish(progress);
    ASSERT_TRUE(isBarHidden());
    progress->indeterminate = false;
    progress->fraction = 0.5;

    progress->tell(fractionCompletedKeyPath);

    EXPECT_FALSE(isBarHidden());
    EXPECT_EQ(view->progressBar()->progress(), 0.5F);
    EXPECT_EQ(text(), Text("Uploading"));
    end();
}

TEST_F(FooterProgress, TheFractionIsNarrowedToSinglePrecision) {
    const auto progress = progressCalled("Uploading");
    progress->fraction = 0.1;

    const auto end = platform.progressReports.publish(progress);

    EXPECT_EQ(view->progressBar()->progress(), 0.1F);
    end();
}

TEST_F(FooterProgress, AChangeOfAnotherObjectIsTheBaseClasss) {
    Thing thing;
    view->layoutIfNeeded();

    view->observeValueForKeyPath(KeyPath("size"), {.ofObject = thing, .change = {}});

    EXPECT_EQ(text(), Text("    "));
    EXPECT_TRUE(isBarHidden());
    EXPECT_FALSE(view->needsLayout());
    ASSERT_EQ(syslog.lines.size(), 1U);
    EXPECT_NE(syslog.lines[0].second.find("size"), std::string::npos);
}

TEST_F(FooterProgress, AMissingSentenceUnderAnIndeterminateProgressSuspendsTheTimer) {
    postLastSync({{MRSyncStatusLastSyncDateKey, now}});
    ASSERT_TRUE(isAutoUpdating());
    const auto progress = progressCalled("Uploading");
    const auto end = platform.progressReports.publish(progress);
    timer().calls.clear();
    platform.lastSync.sentence = Text();

    progress->indeterminate = true;
    progress->tell(KeyPath("fractionCompleted"));

    EXPECT_EQ(timer().calls, Calls{"suspend"});
    EXPECT_FALSE(text());
    EXPECT_TRUE(view->isSyncing());
    end();
}

} // namespace
} // namespace nimbra::test
