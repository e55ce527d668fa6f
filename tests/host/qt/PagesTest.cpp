#include "host/core/PaneSession.h"
#include "platform/system/NotificationCenter.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/WindowFixture.h"
#include "tests/support/ProgramRun.h"

#include <QGuiApplication>
#include <QSignalSpy>
#include <thread>

namespace nimbra::window {

namespace {

class Pages : public WindowTest {
protected:
    /// What the line at the top says; empty where there is none.
    [[nodiscard]] std::string notice() {
        return window().property("notice").toString().toStdString();
    }
    /// Another host changes the device.
    void setElsewhere(const std::string& label, const std::string& value) const {
        const auto result =
            test::runProgram({NIMBRA_SETTINGSCTL, "--root", root().string(), "set", label, value},
                             {"HOME=" + home().string()});
        ASSERT_EQ(result.status, 0) << result.messages;
    }
};

} // namespace

TEST_F(Pages, TheEntryLeadsToThePaneAndBack) {
    makeUsedDevice();
    start();
    ASSERT_EQ(labels(), (std::vector<std::string>{"Nimbra Drive"}));
    EXPECT_FALSE(pane().isOpen());
    EXPECT_EQ(window().title(), QStringLiteral("Settings"));

    key(Qt::Key_Return);
    EXPECT_TRUE(pane().isOpen());
    EXPECT_EQ(window().title(), QStringLiteral("Nimbra Drive"));
    EXPECT_GT(labels().size(), 2U);

    click(control(QStringLiteral("Back, Account")));
    EXPECT_FALSE(pane().isOpen());
    EXPECT_FALSE(session().isPaneOpen());
    EXPECT_TRUE(row(labels().front())->hasActiveFocus());
}

TEST_F(Pages, ThePageOfTheDatabaseOpensOverThePaneAndBack) {
    makeSampleDevice();
    openPane();
    const std::string link = "Look Me Up by Email";
    EXPECT_EQ(descriptionOf(row(link)), "3 apps");

    click(row(link));
    ASSERT_TRUE(pane().property("isDetailOpen").toBool());
    EXPECT_TRUE(isSaid(QStringLiteral("Look Me Up")));
    EXPECT_EQ(nameOf(list()), "Look Me Up");
    EXPECT_TRUE(list()->hasActiveFocus());
    // The pane under it cannot be reached.
    EXPECT_EQ(control(QStringLiteral("Notes"), QAccessible::CheckBox), nullptr);

    key(Qt::Key_Escape);
    EXPECT_FALSE(pane().property("isDetailOpen").toBool());
    EXPECT_TRUE(pane().isOpen());
    EXPECT_TRUE(row(link)->hasActiveFocus());

    act(row(link), QAccessibleActionInterface::pressAction());
    ASSERT_TRUE(pane().property("isDetailOpen").toBool());
    click(control(QStringLiteral("Back, Nimbra Drive")));
    EXPECT_FALSE(pane().property("isDetailOpen").toBool());
    EXPECT_TRUE(row(link)->hasActiveFocus());
}

TEST_F(Pages, ARowKeepsItsHeightUnderAnotherPage) {
    makeSampleDevice();
    openPane();
    // With an explanation and the status of the sync below it.
    const QQuickItem* const first = row("Nimbra Drive");
    const qreal height = first->height();

    click(row("Look Me Up by Email"));

    ASSERT_TRUE(pane().property("isDetailOpen").toBool());
    ASSERT_FALSE(first->isVisible());
    EXPECT_EQ(first->height(), height);
}

TEST_F(Pages, ComingBackFromTheDatabaseShowsItsNumberOfNow) {
    makeSampleDevice();
    openPane();
    const std::string link = "Look Me Up by Email";
    ASSERT_EQ(descriptionOf(row(link)), "3 apps");
    click(row(link));
    ASSERT_TRUE(pane().property("isDetailOpen").toBool());
    test::writeTestFile(root() / "System/Library/PreferenceBundles/AccountSettings"
                                 "/TessarySettings.bundle/app-groups.json",
                        "{\n  \"numAppGroups\": 5\n}\n");

    key(Qt::Key_Escape);

    ASSERT_FALSE(pane().property("isDetailOpen").toBool());
    EXPECT_EQ(descriptionOf(row(link)), "5 apps");
    EXPECT_EQ(row(link)->property("value").toString(), QStringLiteral("5 apps"));
}

TEST_F(Pages, ARowIsShownLitAndFocusedWhereTheUserIsLedToIt) {
    makeSampleDevice();
    start();

    ASSERT_TRUE(_host->showRow("Use Cellular Data"));
    settle();

    ASSERT_TRUE(pane().isOpen());
    QQuickItem* const led = control(QStringLiteral("Use Cellular Data"), QAccessible::CheckBox);
    ASSERT_NE(led, nullptr);
    EXPECT_TRUE(led->hasActiveFocus());
    EXPECT_TRUE(led->property("isLit").toBool());
    const qreal place = led->mapToItem(list(), QPointF()).y();
    EXPECT_GE(place, 0);
    EXPECT_LE(place + led->height(), list()->height());
    // Until it has been used.
    key(Qt::Key_Space);
    EXPECT_FALSE(row("Use Cellular Data")->property("isLit").toBool());
    EXPECT_TRUE(row("Use Cellular Data")->property("isOn").toBool());
}

TEST_F(Pages, AnIdentifierLeadsToItsRow) {
    makeSampleDevice();
    start();

    ASSERT_TRUE(_host->showRow("org.example.reader"));
    settle();

    ASSERT_NE(window().activeFocusItem(), nullptr);
    EXPECT_EQ(window().activeFocusItem()->property("label").toString(),
              QStringLiteral("org.example.reader"));
}

TEST_F(Pages, ARowThatIsNotThereIsNamed) {
    makeUsedDevice();
    start();

    const auto shown = _host->showRow("No Such Row");

    ASSERT_FALSE(shown);
    EXPECT_NE(shown.error().find("No Such Row"), std::string::npos);
}

TEST_F(Pages, InTheFirstSetupNothingIsStored) {
    makeUsedDevice();
    Arguments setup = arguments();
    setup.firstSetup = true;
    openPane(setup);

    click(row("Nimbra Drive"));
    EXPECT_FALSE(row("Nimbra Drive")->property("isOn").toBool());
    _host.reset();

    openPane();
    EXPECT_TRUE(row("Nimbra Drive")->property("isOn").toBool());
}

TEST_F(Pages, WhatAnotherHostHasChangedIsSeenWhenTheWindowBecomesActive) {
    makeUsedDevice();
    openPane();
    ASSERT_TRUE(row("notes")->property("isOn").toBool());

    setElsewhere("notes", "off");
    pane().becomeActive();
    settle();

    EXPECT_FALSE(row("notes")->property("isOn").toBool());
    EXPECT_FALSE(stateOf(row("notes")).checked);
}

TEST_F(Pages, AWindowThatComesToTheFrontLooksAgain) {
    makeUsedDevice();
    openPane();
    setElsewhere("notes", "off");
    setElsewhere("atlas", "on");

    Q_EMIT qGuiApp->applicationStateChanged(Qt::ApplicationInactive);
    settle();
    EXPECT_TRUE(row("notes")->property("isOn").toBool());
    Q_EMIT qGuiApp->applicationStateChanged(Qt::ApplicationActive);
    settle();

    EXPECT_FALSE(row("notes")->property("isOn").toBool());
    EXPECT_TRUE(row("atlas")->property("isOn").toBool());
}

TEST_F(Pages, AnAccountThatAnotherHostHasChangedIsSeenAsWell) {
    makeUsedDevice();
    openPane();
    const auto before = labels();
    QSignalSpy resets(pane().rows(), &QAbstractItemModel::modelReset);
    setElsewhere("Nimbra Drive", "off");

    pane().becomeActive();
    settle();
    EXPECT_FALSE(row("Nimbra Drive")->property("isOn").toBool());
    EXPECT_LT(labels().size(), before.size());

    setElsewhere("Nimbra Drive", "on");
    pane().becomeActive();
    settle();
    EXPECT_TRUE(row("Nimbra Drive")->property("isOn").toBool());
    EXPECT_EQ(labels(), before);
    EXPECT_TRUE(pane().isOpen());
    EXPECT_EQ(resets.count(), 0);
}

TEST_F(Pages, NothingIsOpenedAnewUnderADetailPage) {
    makeSampleDevice();
    openPane();
    click(row("Look Me Up by Email"));
    setElsewhere("Nimbra Drive", "off");

    pane().becomeActive();
    settle();

    EXPECT_EQ(labels().size(), 3U);
}

TEST_F(Pages, APaneThatIsOpenedAgainHasTheAccountOfNow) {
    makeUsedDevice();
    openPane();
    const auto before = labels();
    setElsewhere("Nimbra Drive", "off");

    key(Qt::Key_Escape);
    click(row(labels().front()));

    EXPECT_FALSE(row("Nimbra Drive")->property("isOn").toBool());
    EXPECT_LT(labels().size(), before.size());
}

TEST_F(Pages, AHostThatDiedIsToldOfUntilTheUserHasSeenIt) {
    makeUsedDevice();
    dieWithThePaneOpen();
    const std::string told = "The settings ended unexpectedly while “Nimbra Drive” was open.";

    start();
    EXPECT_FALSE(pane().isOpen());
    EXPECT_EQ(notice(), told);
    EXPECT_TRUE(isSaid(QString::fromStdString(told)));

    click(control(QStringLiteral("Dismiss")));
    EXPECT_EQ(notice(), "");
    EXPECT_FALSE(isSaid(QString::fromStdString(told)));
    EXPECT_TRUE(row(labels().front())->hasActiveFocus());
}

TEST_F(Pages, AHostThatEndsInOrderIsNoNews) {
    makeUsedDevice();
    openPane();
    _host.reset();

    start();

    EXPECT_EQ(notice(), "");
}

TEST_F(Pages, APaneThatCannotBeOpenedIsToldOnThePageBelow) {
    // Given a device whose accounts cannot be read any more
    makeUsedDevice();
    start();
    test::writeTestFile(root() / "var/lib/nimbra/accounts.db", "no database at all");

    click(row(labels().front()));

    EXPECT_FALSE(pane().isOpen());
    EXPECT_NE(notice(), "");
    EXPECT_TRUE(isSaid(QString::fromStdString(notice())));
    EXPECT_EQ(labels().size(), 1U);

    // Who has read it does not see it again.
    click(control(QStringLiteral("Dismiss")));
    pane().becomeActive();
    settle();
    EXPECT_EQ(notice(), "");
}

TEST_F(Pages, AfterAHostHasDiedARowThatIsAskedForIsShownUnderTheWordAboutIt) {
    makeUsedDevice();
    dieWithThePaneOpen();
    Arguments asked = arguments();
    asked.row = "Notes";

    start(asked);
    ASSERT_TRUE(_host->showRow("Notes"));
    settle();

    EXPECT_TRUE(pane().isOpen());
    EXPECT_EQ(focusedName(), "Notes");
    EXPECT_NE(notice(), "");
    EXPECT_FALSE(_host->showRow("No Such Row"));
}

TEST_F(Pages, AListThatIsBuiltElsewhereDoesNotOutliveItsPane) {
    makeUsedDevice();
    openPane();
    std::thread([this] {
        session().post({.name = ApplicationDidBecomeActiveNotification});
    }).join();

    pane().goBack();
    settle();

    EXPECT_EQ(pane().rows()->rowCount(), 0);
}

TEST_F(Pages, ARowThatHasGoneDoesNothing) {
    makeUsedDevice();
    openPane();
    const auto before = labels();

    pane().rows()->tap(-1);
    pane().rows()->set(pane().rows()->rowCount(), true);
    settle();

    EXPECT_EQ(labels(), before);
}

TEST_F(Pages, ABundleThatIsNotThereIsAnError) {
    makeUsedDevice();
    Arguments without = arguments();
    without.bundle = place("none");

    const auto made = SettingsHost::make(without);

    ASSERT_FALSE(made);
    EXPECT_NE(made.error().find(place("none").string()), std::string::npos);
}

TEST_F(Pages, ADeviceThatCannotBeUsedIsAnError) {
    std::filesystem::create_directory(root());

    const auto made = SettingsHost::make(arguments());

    ASSERT_FALSE(made);
    EXPECT_NE(made.error().find(root().string()), std::string::npos);
    EXPECT_EQ(made.error().find('\n'), std::string::npos);
}

} // namespace nimbra::window
