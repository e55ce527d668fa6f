#include "host/core/FooterDescription.h"

#include "platform/host/HeaderFooterView.h"
#include "platform/views/Label.h"
#include "platform/views/ProgressView.h"
#include "tests/support/TestPlatform.h"

#include <gtest/gtest.h>
#include <memory>

namespace nimbra::host {
namespace {

/// A view that says of itself what a test wants.
class TellingView final : public HeaderFooterView {
public:
    using HeaderFooterView::HeaderFooterView;

    [[nodiscard]] double preferredHeightForWidthInTableView(double /*width*/,
                                                            const Table* /*table*/) const override {
        return 23;
    }
    [[nodiscard]] RowValue valueForKey(const KeyPath& key) const override {
        return key.string() == trueKey ? RowValue(true) : RowValue();
    }

    std::string trueKey;
};

TEST(FooterDescription, TellsOfBarAndLabel) {
    test::TestPlatform platform;
    const auto view = std::make_shared<TellingView>(platform.services(), Rect());
    const auto bar =
        std::make_shared<ProgressView>(platform.services(), ProgressViewStyle::standard);
    bar->setProgressAnimated(0.25F, false);
    const auto label = std::make_shared<Label>(platform.services(), Rect());
    label->setText("Uploading");
    view->addSubview(bar);
    view->addSubview(label);

    const auto description = FooterDescription::of(*view);

    EXPECT_FALSE(description.barHidden);
    EXPECT_EQ(description.barProgress, 0.25F);
    EXPECT_EQ(description.barHeight, platform.viewMetrics.progressBarHeight());
    EXPECT_EQ(description.text, Text("Uploading"));
    EXPECT_EQ(description.lineHeight, label->lineHeight());
    EXPECT_EQ(description.height, 23);
    bar->setHidden(true);
    EXPECT_TRUE(FooterDescription::of(*view).barHidden);
}

TEST(FooterDescription, TellsWhatTheViewSaysOfItself) {
    test::TestPlatform platform;
    const auto view = std::make_shared<TellingView>(platform.services(), Rect());

    EXPECT_FALSE(FooterDescription::of(*view).syncing);
    view->trueKey = "syncing";
    EXPECT_TRUE(FooterDescription::of(*view).syncing);
    EXPECT_FALSE(FooterDescription::of(*view).timerRunning);
    view->trueKey = "lastSyncAutoUpdate";
    EXPECT_TRUE(FooterDescription::of(*view).timerRunning);
    EXPECT_FALSE(FooterDescription::of(*view).subscribed);
    view->trueKey = "subscribed";
    EXPECT_TRUE(FooterDescription::of(*view).subscribed);
}

TEST(FooterDescription, AViewWithoutBarAndLabelHasAHeightOnly) {
    test::TestPlatform platform;
    const auto view = std::make_shared<TellingView>(platform.services(), Rect());

    EXPECT_EQ(FooterDescription::of(*view), (FooterDescription{.height = 23}));
}

} // namespace
} // namespace nimbra::host
