#include "host/core/PaneSession.h"
#include "platform/views/Button.h"
#include "tests/host/qt/WindowFixture.h"

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
    [[nodiscard]] bool isScreenShown() {
        return session().presentations().screen() != nullptr && named("screenButton") != nullptr;
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
