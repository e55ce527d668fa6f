#include "host/core/PaneSession.h"
#include "platform/views/Button.h"
#include "platform/views/Label.h"
#include "tests/host/qt/WindowFixture.h"

#include <memory>
#include <utility>
#include <vector>

namespace nimbra::window {

namespace {

constexpr const char* upgradeRow = "Upgrade to Nimbra Drive";

class UpgradeScreen : public WindowTest {
protected:
    void openPaneOfOlderStorage(const std::string& more = {}) {
        makeDevice(R"({"accounts": [{"identifier": "primary", "primary": true,
                                     "usesStratafile": false}],
            "deviceList": {"needUpgrade": ["Work Phone"]})" +
                   more + '}');
        openPane();
    }
    void openScreen() {
        click(row(upgradeRow));
        ASSERT_TRUE(isSaid(QStringLiteral("Nimbra Drive")));
        ASSERT_NE(upgradeButton(), nullptr);
    }
    [[nodiscard]] QQuickItem* upgradeButton() { return control(QStringLiteral("Upgrade")); }
    [[nodiscard]] bool isQuestionShown() {
        return isSaid(QStringLiteral("Upgrade to Nimbra Drive?")) &&
               control(QStringLiteral("Continue")) != nullptr;
    }
    /// What is seen of the screen, of this class, back to front.
    template <class Class>
    [[nodiscard]] std::vector<std::shared_ptr<Class>> views() {
        std::vector<std::shared_ptr<Class>> found;
        collect(session().presentations().screen()->view(), found);
        return found;
    }
    /// Draws the screen as its views are now.
    void drawAnew() {
        _host->pump().run();
        settle();
    }
    [[nodiscard]] bool isScreenShown() {
        return session().presentations().screen() != nullptr && named("screenButton") != nullptr;
    }

private:
    template <class Class>
    // NOLINTNEXTLINE(misc-no-recursion): a tree
    static void collect(const std::shared_ptr<View>& view,
                        std::vector<std::shared_ptr<Class>>& found) {
        if (view->isHidden()) {
            return;
        }
        if (auto wanted = std::dynamic_pointer_cast<Class>(view)) {
            found.push_back(std::move(wanted));
        }
        for (const auto& subview : view->subviews()) {
            collect(subview, found);
        }
    }
};

} // namespace

TEST_F(UpgradeScreen, TheMouseUpgradesTheAccountAndLeadsBackToIt) {
    openPaneOfOlderStorage();
    openScreen();
    click(upgradeButton());
    ASSERT_TRUE(isQuestionShown());
    EXPECT_TRUE(
        isSaid(QStringLiteral("Your documents will move to Nimbra Drive. You can’t undo this.")));

    click(control(QStringLiteral("Continue")));

    // The page has closed itself: the one of the account is there again, and says how it is.
    EXPECT_FALSE(pane().isOpen());
    EXPECT_FALSE(isScreenShown());
    ASSERT_EQ(labels().size(), 1U);
    click(row(labels().front()));
    ASSERT_TRUE(pane().isOpen());
    EXPECT_EQ(row(upgradeRow), nullptr);
    EXPECT_TRUE(row("Nimbra Drive")->property("isOn").toBool());
}

TEST_F(UpgradeScreen, TheKeyboardUpgradesTheAccount) {
    openPaneOfOlderStorage();
    ASSERT_EQ(focusedName(), upgradeRow);

    // The sheet begins with its way out, and the question with the answer that does nothing.
    key(Qt::Key_Return);
    EXPECT_EQ(focusedName(), "Cancel");
    key(Qt::Key_Tab);
    EXPECT_EQ(focusedName(), "Upgrade");
    key(Qt::Key_Space);
    ASSERT_TRUE(isQuestionShown());
    EXPECT_EQ(focusedName(), "Cancel");
    key(Qt::Key_Tab);
    EXPECT_EQ(focusedName(), "Continue");
    key(Qt::Key_Return);

    EXPECT_FALSE(pane().isOpen());
    EXPECT_TRUE(row(labels().front())->hasActiveFocus());
}

TEST_F(UpgradeScreen, AScreenReaderUpgradesTheAccount) {
    openPaneOfOlderStorage();
    act(row(upgradeRow), QAccessibleActionInterface::pressAction());
    ASSERT_NE(control(QStringLiteral("Nimbra Drive"), QAccessible::Dialog), nullptr);

    act(upgradeButton(), QAccessibleActionInterface::pressAction());
    ASSERT_NE(control(QStringLiteral("Upgrade to Nimbra Drive?"), QAccessible::Dialog), nullptr);
    act(control(QStringLiteral("Continue")), QAccessibleActionInterface::pressAction());

    EXPECT_FALSE(pane().isOpen());
}

TEST_F(UpgradeScreen, EscapeTakesBackOneThingAtATime) {
    openPaneOfOlderStorage();
    openScreen();
    click(upgradeButton());
    ASSERT_TRUE(isQuestionShown());

    key(Qt::Key_Escape);
    EXPECT_FALSE(isQuestionShown());
    EXPECT_TRUE(isScreenShown());
    // The focus is back in the screen.
    EXPECT_EQ(focusedName(), "Cancel");

    key(Qt::Key_Escape);
    EXPECT_FALSE(isScreenShown());
    EXPECT_TRUE(pane().isOpen());
    EXPECT_TRUE(row(upgradeRow)->hasActiveFocus());

    key(Qt::Key_Escape);
    EXPECT_FALSE(pane().isOpen());
}

TEST_F(UpgradeScreen, CancelOfTheQuestionAndOfTheScreenLeaveAllAsItWas) {
    openPaneOfOlderStorage();
    const auto before = labels();
    openScreen();
    click(upgradeButton());

    click(control(QStringLiteral("Cancel")));
    ASSERT_FALSE(isQuestionShown());
    ASSERT_TRUE(isScreenShown());
    click(control(QStringLiteral("Cancel")));

    EXPECT_FALSE(isScreenShown());
    EXPECT_EQ(labels(), before);
}

TEST_F(UpgradeScreen, AFailureIsToldAndThePageStays) {
    openPaneOfOlderStorage(R"(, "faults": {"save": [
        {"domain": "accounts", "code": 13, "description": "the disk is full"}]})");
    openScreen();
    click(upgradeButton());

    click(control(QStringLiteral("Continue")));

    ASSERT_NE(control(QStringLiteral("Upgrade Failed"), QAccessible::Dialog), nullptr);
    EXPECT_TRUE(isSaid(
        QStringLiteral("Your account couldn’t be upgraded to Nimbra Drive. Try again later.")));
    EXPECT_EQ(focusedName(), "OK");
    // Nothing under the alert can be reached.
    EXPECT_EQ(upgradeButton(), nullptr);
    key(Qt::Key_Tab);
    EXPECT_EQ(focusedName(), "OK");

    // Its one answer is what Escape means as well.
    key(Qt::Key_Escape);
    EXPECT_FALSE(isSaid(QStringLiteral("Upgrade Failed")));
    EXPECT_FALSE(isScreenShown());
    EXPECT_TRUE(pane().isOpen());
    EXPECT_TRUE(row(upgradeRow)->hasActiveFocus());

    // The next time it works.
    openScreen();
    click(upgradeButton());
    click(control(QStringLiteral("Continue")));
    EXPECT_FALSE(pane().isOpen());
}

TEST_F(UpgradeScreen, TheFocusStaysOnTheButtonWhenViewsComeAndGoAroundIt) {
    openPaneOfOlderStorage();
    openScreen();
    key(Qt::Key_Tab);
    ASSERT_EQ(focusedName(), "Upgrade");
    const auto label = views<Label>().front();

    for (const bool isHidden : {true, false}) {
        label->setHidden(isHidden);
        drawAnew();

        EXPECT_EQ(focusedName(), "Upgrade") << isHidden;
        EXPECT_EQ(window().activeFocusItem(), upgradeButton());
    }
    // and it works from there
    key(Qt::Key_Space);
    EXPECT_TRUE(isQuestionShown());
}

TEST_F(UpgradeScreen, TheFocusGoesToTheButtonThatTakesThePlaceOfItsOwn) {
    openPaneOfOlderStorage();
    openScreen();
    key(Qt::Key_Tab);
    ASSERT_EQ(focusedName(), "Upgrade");

    // When the button is called something else, among other views
    views<Button>().front()->setTitleForState("Go On", ControlState::normal);
    views<Label>().front()->setHidden(true);
    drawAnew();

    EXPECT_EQ(focusedName(), "Go On");
}

TEST_F(UpgradeScreen, TheFocusGoesToTheWayOutWhereItsButtonGoes) {
    openPaneOfOlderStorage();
    openScreen();
    key(Qt::Key_Tab);
    ASSERT_EQ(focusedName(), "Upgrade");

    views<Button>().front()->setHidden(true);
    drawAnew();

    EXPECT_EQ(upgradeButton(), nullptr);
    EXPECT_EQ(focusedName(), "Cancel");
}

TEST_F(UpgradeScreen, WhereTheFocusIsElsewhereItStaysWhenTheButtonIsDrawnAnew) {
    openPaneOfOlderStorage();
    openScreen();
    ASSERT_EQ(focusedName(), "Cancel");

    views<Label>().front()->setHidden(true);
    drawAnew();

    EXPECT_EQ(focusedName(), "Cancel");
}

TEST_F(UpgradeScreen, ItsViewsStandWhereThePageHasPutThem) {
    openPaneOfOlderStorage();
    openScreen();

    const QQuickItem* const button = upgradeButton();
    const auto usable = session().presentations().usableButton();
    ASSERT_NE(usable, nullptr);
    const auto& frame = usable->frame();
    EXPECT_EQ(button->width(), frame.size.width);
    EXPECT_EQ(button->height(), frame.size.height);
}

} // namespace nimbra::window
