#include "host/qt/Appearance.h"
#include "host/qt/DesktopSettings.h"
#include "tests/device/TestFiles.h"
#include "tests/host/qt/DesktopPalette.h"
#include "tests/host/qt/SilentBus.h"
#include "tests/support/EnvironmentVariable.h"
#include "tests/support/TemporaryDirectory.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <gtest/gtest.h>
#include <optional>

namespace nimbra::window {

namespace {

using test::usePalette;

/// How an appearance comes to its bus, or does not.
class DesktopBus : public testing::Test {
protected:
    ~DesktopBus() override { usePalette(Qt::white); }

    static QString connection() { return QStringLiteral("bus"); }

    test::EnvironmentVariable _bus{"DBUS_SESSION_BUS_ADDRESS", std::nullopt};
    test::EnvironmentVariable _runtime{"XDG_RUNTIME_DIR", std::nullopt};
};

} // namespace

TEST_F(DesktopBus, WithoutABusThePaletteDecidesOnDark) {
    const Appearance told({}, QStringLiteral("unix:path=/nonexistent"), connection());
    const Appearance homeless({}, QString(), QStringLiteral("homeless"));
    EXPECT_FALSE(told.isDark());
    usePalette(Qt::black);
    EXPECT_TRUE(told.isDark());
    EXPECT_TRUE(homeless.isDark());
}

TEST_F(DesktopBus, WhereEverythingIsChosenNobodyIsAsked) {
    const test::SilentBus bus;
    {
        const Appearance told(
            {.dark = true, .highContrast = false, .reducedMotion = true, .textScale = 2},
            QString::fromStdString(bus.address()), connection());
        usePalette(Qt::black);
        usePalette(Qt::white);
        EXPECT_TRUE(told.isDark());
        EXPECT_FALSE(told.isHighContrast());
        EXPECT_TRUE(told.isMotionReduced());
        EXPECT_EQ(told.textScale(), 2);
    }
    // Whoever was still on the way has come by now.
    EXPECT_FALSE(bus.hasCaller());
}

TEST_F(DesktopBus, ABusThatNeverAnswersIsNotWaitedFor) {
    // Given a bus that takes a connection and says nothing
    test::SilentBus bus;
    std::optional<Appearance> told;

    // When an appearance is made on it, and has asked
    told.emplace(Appearance::Choice{}, QString::fromStdString(bus.address()), connection());
    bus.take();
    while (!QDBusConnection(connection()).isConnected()) {
        QCoreApplication::processEvents();
    }
    QCoreApplication::processEvents();

    // Then all is as without a desktop, while the answer is still to come
    EXPECT_FALSE(told->isDark());
    usePalette(Qt::black);
    EXPECT_TRUE(told->isDark());
    EXPECT_TRUE(bus.isWaitedFor());

    // And it ends without one
    told.reset();
    bus.awaitLeaving();
}

TEST_F(DesktopBus, AnAppearanceMayEndWhileItIsOnItsWayToTheBus) {
    test::SilentBus bus;
    {
        const Appearance told({}, QString::fromStdString(bus.address()), connection());
    }
    // What it has been told is told to nobody.
    QCoreApplication::processEvents();
    bus.take();
    bus.awaitLeaving();
}

TEST_F(DesktopBus, TheBusIsWhereTheEnvironmentSays) {
    _bus.set("unix:path=/told");
    EXPECT_EQ(DesktopSettings::sessionBus(), QStringLiteral("unix:path=/told"));

    // Or where every user has one.
    const test::TemporaryDirectory folder;
    _runtime.set(folder.path().string());
    _bus.set(std::nullopt);
    EXPECT_EQ(DesktopSettings::sessionBus(), QString());
    test::writeTestFile(folder.path() / "bus", "");
    EXPECT_EQ(DesktopSettings::sessionBus().toStdString(),
              "unix:path=" + (folder.path() / "bus").string());
    _runtime.set(std::nullopt);
    EXPECT_EQ(DesktopSettings::sessionBus(), QString());
}

} // namespace nimbra::window
