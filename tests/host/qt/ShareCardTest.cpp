#include "host/core/PaneSession.h"
#include "platform/views/TableCell.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/Gate.h"
#include "tests/host/qt/WindowFixture.h"

#include <QClipboard>
#include <QGuiApplication>
#include <QTest>
#include <cerrno>
#include <csignal>
#include <fstream>
#include <sys/stat.h>
#include <sys/wait.h>

namespace nimbra::window {

namespace {

namespace files = std::filesystem;

constexpr const char* diagnose = "CLOUD_DRIVE_DIAGNOSE";

class ShareCard : public WindowTest {
protected:
    ShareCard() {
        makeUsedDevice(R"(, "preferences": {"com.vantrel.marrow": {"log.level": 7}})");
        writeTool(R"(echo collected > "$3")");
    }

    /// `commands` are those of a shell; the archive's path is "$3" to them.
    void writeTool(const std::string& commands) const {
        writeProgram(root() / "usr/bin/mrctl", commands);
    }
    static void writeProgram(const files::path& program, const std::string& commands) {
        test::writeTestFile(program, "#!/bin/sh\n" + commands + '\n');
        files::permissions(program, files::perms::all);
    }
    void openCard() {
        ASSERT_NO_FATAL_FAILURE(openPane());
        click(row(diagnose));
        ASSERT_TRUE(isCardShown());
    }
    [[nodiscard]] bool isCardShown() {
        const bool isShown = control(QStringLiteral("Share"), QAccessible::Dialog) != nullptr;
        EXPECT_EQ(isShown, session().presentations().shareSheet() != nullptr);
        return isShown;
    }
    [[nodiscard]] QQuickItem* placeField() {
        return control(QStringLiteral("Folder or file"), QAccessible::EditableText);
    }
    [[nodiscard]] QString archiveName() { return _host->sharing().property("fileName").toString(); }
    [[nodiscard]] QString problem() { return _host->sharing().property("problem").toString(); }
    /// Has mail begun by a program that waits at `gate` and ends with `status`. Gives back its
    /// process when it runs.
    pid_t beginMail(const Gate& gate, int status) {
        const auto programs = place("programs");
        const auto started = place("started");
        EXPECT_EQ(::mkfifo(started.c_str(), 0600), 0);
        writeProgram(programs / "xdg-email", "echo $$ > " + started.string() + '\n' +
                                                 gate.command() + "; exit " +
                                                 std::to_string(status));
        setEnvironment("PATH", programs.string() + ":/usr/bin:/bin");
        openCard();
        click(control(QStringLiteral("Mail")));
        pid_t process = 0;
        std::ifstream(started) >> process;
        EXPECT_GT(process, 0);
        return process;
    }
    /// Until the window has taken the end of `process`.
    [[nodiscard]] bool waitForEndOf(pid_t process) {
        return waitFor([process] { return ::kill(process, 0) != 0 && errno == ESRCH; });
    }
    void expectRowHasTheFocus() {
        EXPECT_FALSE(isCardShown());
        EXPECT_TRUE(row(diagnose)->hasActiveFocus());
    }
};

} // namespace

TEST_F(ShareCard, NothingOfThePageCanBeUsedWhileItCollects) {
    // Given a tool that takes its time
    const Gate gate(place("gate"));
    writeTool(gate.command() + R"(; echo collected > "$3")");
    openPane();
    QQuickItem* const notes = row("notes");
    QQuickItem* const button = row(diagnose);

    // When it has been set going
    QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier,
                      button->mapToScene(QPointF(button->width() / 2, 26)).toPoint());
    ASSERT_TRUE(waitFor([this] { return session().activity().isPresent(); }));
    static_cast<void>(window().grabWindow());

    // Then the page says so, and lets nobody in
    const QString told = QStringLiteral("Collecting Diagnostics…");
    EXPECT_NE(control(told, QAccessible::Dialog), nullptr);
    EXPECT_EQ(focusedName(), told.toStdString());
    EXPECT_FALSE(notes->isEnabled());
    QTest::keyClick(&window(), Qt::Key_Escape);
    QTest::keyClick(&window(), Qt::Key_Tab);
    QTest::keyClick(&window(), Qt::Key_Left, Qt::AltModifier);
    EXPECT_TRUE(pane().isOpen());
    EXPECT_EQ(focusedName(), told.toStdString());

    // and when it is done, what it has collected is offered
    gate.open();
    settle();
    EXPECT_EQ(control(told, QAccessible::Dialog), nullptr);
    EXPECT_TRUE(isCardShown());
    EXPECT_EQ(focusedName(), "Cancel");
}

TEST_F(ShareCard, ItPointsToTheButtonOnlyWhereThatIsInSight) {
    // Given a list that is longer than the window, and a tool that takes its time
    const Gate gate(place("gate"));
    writeTool(gate.command() + R"(; echo collected > "$3")");
    Arguments small = arguments();
    small.size = {320, 320};
    small.appearance.textScale = 2;
    openPane(small);
    const auto collect = [&](bool scrollsAway) {
        row(diagnose)->forceActiveFocus();
        QTest::keyClick(&window(), Qt::Key_Return);
        ASSERT_TRUE(waitFor([this] { return session().activity().isPresent(); }));
        if (scrollsAway) {
            list()->setProperty("contentY", list()->property("originY"));
        }
        static_cast<void>(window().grabWindow());
        gate.open();
        settle();
        ASSERT_TRUE(isCardShown());
    };
    const auto sourceView = [this] {
        return session().presentations().shareSheet()->popoverPresentationController().sourceView;
    };

    // When its button is scrolled away meanwhile
    ASSERT_NO_FATAL_FAILURE(collect(true));
    EXPECT_EQ(sourceView(), nullptr);

    // and when it is not
    key(Qt::Key_Escape);
    ASSERT_NO_FATAL_FAILURE(collect(false));
    const auto cell = std::dynamic_pointer_cast<TableCell>(sourceView());
    ASSERT_NE(cell, nullptr);
    EXPECT_EQ(cell->label(), Text(diagnose));
}

TEST_F(ShareCard, ItOffersThePagesWaysInTheirOrder) {
    openCard();

    std::vector<std::string> ways;
    for (QAccessibleInterface* const found : accessibles()) {
        auto* const item = qobject_cast<QQuickItem*>(found->object());
        if (item != nullptr && item->objectName().startsWith(QLatin1String("way"))) {
            ways.push_back(nameOf(item));
            // Which of them a machine has is its own affair; what it has not says so.
            EXPECT_EQ(descriptionOf(item), item->isEnabled() ? "" : "Not available here");
            EXPECT_EQ(static_cast<bool>(found->state().focusable), item->isEnabled());
        }
    }
    EXPECT_EQ(ways, (std::vector<std::string>{"Message", "Mail", "Nearby Devices"}));
    EXPECT_TRUE(isSaid(archiveName()));
    EXPECT_TRUE(archiveName().startsWith(QLatin1String("stratafile-")));
}

TEST_F(ShareCard, ACopyIsSavedWhereTheUserSays) {
    files::create_directory(place("copies"));
    openCard();
    EXPECT_EQ(placeField()->property("text").toString().toStdString(), home().string());
    placeField()->setProperty("text", QString::fromStdString(place("copies").string()));

    click(control(QStringLiteral("Save a Copy")));

    const files::path copy = place("copies") / archiveName().toStdString();
    EXPECT_EQ(test::contentOf(copy), "collected\n");
    EXPECT_TRUE(isSaid(QString::fromStdString("Saved as " + copy.string())));
    expectRowHasTheFocus();
}

TEST_F(ShareCard, ATildeIsTheUsersOwnFolder) {
    openCard();
    placeField()->setProperty("text", QStringLiteral(" ~/copy.tar.gz"));

    click(control(QStringLiteral("Save a Copy")));

    EXPECT_EQ(test::contentOf(home() / "copy.tar.gz"), "collected\n");
    EXPECT_FALSE(isCardShown());
}

TEST_F(ShareCard, ReturnInTheFieldSavesTheCopy) {
    openCard();
    click(placeField());
    key(Qt::Key_A, Qt::ControlModifier);
    type(QString::fromStdString(place("typed.tar.gz").string()));

    key(Qt::Key_Return);

    EXPECT_EQ(test::contentOf(place("typed.tar.gz")), "collected\n");
    EXPECT_FALSE(isCardShown());
}

TEST_F(ShareCard, WhatStandsThereAlreadyIsKeptAndTold) {
    test::writeTestFile(place("taken"), "mine");
    openCard();
    placeField()->setProperty("text", QString::fromStdString(place("taken").string()));

    click(control(QStringLiteral("Save a Copy")));

    EXPECT_EQ(test::contentOf(place("taken")), "mine");
    EXPECT_TRUE(isCardShown());
    EXPECT_NE(problem(), QString());
    ASSERT_TRUE(isSaid(problem()));
    EXPECT_NE(problem().toStdString().find(place("taken").string()), std::string::npos);

    // Another place is good.
    placeField()->setProperty("text", QString::fromStdString(place("free").string()));
    click(control(QStringLiteral("Save a Copy")));
    EXPECT_EQ(test::contentOf(place("free")), "collected\n");
    expectRowHasTheFocus();
}

TEST_F(ShareCard, WithoutAPlaceNothingCanBeSaved) {
    openCard();
    placeField()->setProperty("text", QStringLiteral("  "));
    settle();

    EXPECT_EQ(control(QStringLiteral("Save a Copy")), nullptr);
}

TEST_F(ShareCard, ThePathIsCopied) {
    QGuiApplication::clipboard()->clear();
    openCard();

    click(control(QStringLiteral("Copy Path")));

    const files::path copied = QGuiApplication::clipboard()->text().toStdString();
    EXPECT_EQ(test::contentOf(copied), "collected\n");
    EXPECT_TRUE(isSaid(QStringLiteral("The path has been copied.")));
    expectRowHasTheFocus();
}

TEST_F(ShareCard, EscapeAndCancelAndTheGroundBesideItGiveUp) {
    openCard();
    key(Qt::Key_Escape);
    expectRowHasTheFocus();

    click(row(diagnose));
    ASSERT_TRUE(isCardShown());
    click(control(QStringLiteral("Cancel")));
    expectRowHasTheFocus();

    click(row(diagnose));
    ASSERT_TRUE(isCardShown());
    QTest::mouseClick(&window(), Qt::LeftButton, Qt::NoModifier, QPoint(20, 20));
    settle();
    expectRowHasTheFocus();
}

TEST_F(ShareCard, MailGetsTheFile) {
    const auto programs = place("programs");
    writeProgram(programs / "xdg-email",
                 "for word; do echo \"$word\"; done > " + place("words").string());
    setEnvironment("PATH", programs.string() + ":/usr/bin:/bin");
    openCard();

    click(control(QStringLiteral("Mail")));
    ASSERT_TRUE(waitFor([this] { return session().presentations().shareSheet() == nullptr; }));
    settle();

    EXPECT_NE(test::contentOf(place("words")).find(archiveName().toStdString()), std::string::npos);
    expectRowHasTheFocus();
}

TEST_F(ShareCard, AMailThatCannotBeBegunIsTold) {
    const auto programs = place("programs");
    writeProgram(programs / "xdg-email", "exit 3");
    setEnvironment("PATH", programs.string() + ":/usr/bin:/bin");
    openCard();

    click(control(QStringLiteral("Mail")));
    ASSERT_TRUE(waitFor([this] { return !problem().isEmpty(); }));
    settle();

    EXPECT_TRUE(isCardShown());
    EXPECT_TRUE(problem().startsWith(QStringLiteral("No mail could be begun: ")));
    EXPECT_TRUE(isSaid(problem()));
}

TEST_F(ShareCard, AMailThatIsStillBeingBegunDoesNotEndTheNextCard) {
    // Given a mail program that takes its time, and a user who has left the card since
    const Gate gate(place("mail"));
    const pid_t process = beginMail(gate, 0);
    ASSERT_TRUE(isCardShown());
    key(Qt::Key_Escape);
    expectRowHasTheFocus();

    // When a card is open again as it ends
    click(row(diagnose));
    ASSERT_TRUE(isCardShown());
    gate.open();
    ASSERT_TRUE(waitForEndOf(process));
    settle();

    // Then that card stands as it was
    EXPECT_TRUE(isCardShown());
    EXPECT_EQ(problem(), QString());
    // and mail can be asked for again
    writeProgram(place("programs") / "xdg-email", "exit 0");
    click(control(QStringLiteral("Mail")));
    ASSERT_TRUE(waitFor([this] { return session().presentations().shareSheet() == nullptr; }));
    settle();
    expectRowHasTheFocus();
}

TEST_F(ShareCard, AMailThatFailsAfterTheCardWasLeftIsNotToldOf) {
    const Gate gate(place("mail"));
    const pid_t process = beginMail(gate, 3);
    key(Qt::Key_Escape);
    expectRowHasTheFocus();

    gate.open();
    ASSERT_TRUE(waitForEndOf(process));
    settle();

    EXPECT_EQ(problem(), QString());
    expectRowHasTheFocus();
    click(row(diagnose));
    ASSERT_TRUE(isCardShown());
    EXPECT_EQ(problem(), QString());
}

TEST_F(ShareCard, AMailIsBegunOnceHoweverOftenItIsAskedFor) {
    const Gate gate(place("mail"));
    const pid_t process = beginMail(gate, 0);

    // The first one is still at it: a second one would write where nobody reads, and wait.
    click(control(QStringLiteral("Mail")));
    gate.open();
    ASSERT_TRUE(waitForEndOf(process));
    settle();

    EXPECT_FALSE(isCardShown());
    EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1);
    EXPECT_EQ(errno, ECHILD);
}

TEST_F(ShareCard, AToolThatFailsLeavesNoCard) {
    writeTool("exit 1");
    openPane();

    click(row(diagnose));

    EXPECT_FALSE(isCardShown());
    EXPECT_FALSE(session().activity());
    ASSERT_TRUE(session().presentations().alert());
    key(Qt::Key_Escape);
    EXPECT_FALSE(session().presentations().alert());
    EXPECT_TRUE(row(diagnose)->hasActiveFocus());
}

} // namespace nimbra::window
