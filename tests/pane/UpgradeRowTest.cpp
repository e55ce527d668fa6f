#include "platform/host/SetupController.h"
#include "tests/pane/PaneFixture.h"
#include "upgrade/RSPUpgradeViewController.h"

#include <gmock/gmock.h>

namespace nimbra::test {
namespace {

using testing::ElementsAre;

struct UpgradeRow : PaneFixture {
    UpgradeRow() {
        pane->makesUpgradeRow = true;
        platform.accountStore.stored.usesStratafile = false;
    }

    std::shared_ptr<RSPUpgradeViewController> tap() {
        pane->specifiers().front()->performButtonAction();
        return std::dynamic_pointer_cast<RSPUpgradeViewController>(
            platform.presenter.presented->rootViewController());
    }
};

TEST_F(UpgradeRow, StandsFirstWhileTheAccountUsesTheOlderStorage) {
    EXPECT_EQ(rows(), "Upgrade RSPNimbraDrive Nimbra Drive");
}

TEST_F(UpgradeRow, IsNotThereForAnAccountThatHasMoved) {
    platform.accountStore.stored.usesStratafile = true;

    EXPECT_EQ(rows(), "RSPNimbraDrive Nimbra Drive");
}

TEST_F(UpgradeRow, IsAPlainButton) {
    const auto row = pane->specifiers().front();

    EXPECT_EQ(row->cellType(), ButtonCell);
    EXPECT_EQ(row->name(), Text("Upgrade"));
    EXPECT_EQ(row->identifier(), Text());
    EXPECT_EQ(row->target(), pane.get());
    EXPECT_FALSE(row->hasSetter());
    EXPECT_EQ(row->value(), RowValue());
    EXPECT_EQ(row->detailControllerClass(), nullptr);
    EXPECT_TRUE(row->hasButtonAction());
}

TEST_F(UpgradeRow, PresentsTheScreenInAFormSheetOverThePage) {
    const auto screen = tap();

    EXPECT_THAT(platform.calls, ElementsAre("present controller, animated"));
    const auto setup = platform.presenter.presented;
    EXPECT_EQ(setup->modalPresentationStyle(), ModalPresentationStyle::formSheet);
    EXPECT_EQ(setup->parentController(), pane);
    ASSERT_NE(screen, nullptr);
    EXPECT_EQ(screen->specifier(), entry);
    EXPECT_EQ(screen->delegate(), pane);
    EXPECT_EQ(screen->parentController(), setup);
    EXPECT_TRUE(platform.presenter.presentedAsSheet) << "before it is presented";
}

TEST_F(UpgradeRow, EachTapMakesAScreenOfItsOwn) {
    const auto first = tap();
    const auto second = tap();

    EXPECT_NE(first, second);
}

TEST_F(UpgradeRow, TheScreenKeepsNeitherThePageNorItsSheet) {
    const auto screen = tap();
    const std::weak_ptr<SetupController> setup = platform.presenter.presented;
    const std::weak_ptr<PaneWithRows> weakPane = pane;

    platform.presenter.presented.reset();
    pane.reset();

    EXPECT_TRUE(setup.expired());
    EXPECT_TRUE(weakPane.expired());
    EXPECT_EQ(screen->delegate(), nullptr);
    EXPECT_EQ(screen->parentController(), nullptr);
}

TEST_F(UpgradeRow, CancellingTheScreenDismissesItAlone) {
    const auto screen = tap();
    platform.calls.clear();

    screen->cancelButtonTapped({});

    EXPECT_THAT(platform.calls, ElementsAre("dismiss presented, animated"));
}

} // namespace
} // namespace nimbra::test
