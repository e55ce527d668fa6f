#include "host/qt/Appearance.h"

#include "tests/host/qt/DesktopPalette.h"
#include "tests/host/qt/PortalStandIn.h"
#include "tests/support/PrivateBus.h"

#include <QCoreApplication>
#include <QDBusConnection>
#include <QDBusVariant>
#include <QRegularExpression>
#include <QSignalSpy>
#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <optional>

namespace nimbra::window {

namespace {

using test::PortalStandIn;
using test::usePalette;

const QString appearance = QStringLiteral("org.freedesktop.appearance");
const QString interface = QStringLiteral("org.gnome.desktop.interface");
const QString accessibility = QStringLiteral("org.gnome.desktop.a11y.interface");
const QString colorScheme = QStringLiteral("color-scheme");
const QString contrast = QStringLiteral("contrast");
const QString highContrast = QStringLiteral("high-contrast");
const QString animations = QStringLiteral("enable-animations");
const QString textScaling = QStringLiteral("text-scaling-factor");

constexpr uint none = 0;
constexpr uint dark = 1;
constexpr uint light = 2;

/// What a desktop says on which everything is other than usual.
PortalStandIn::Values unusual() {
    return {{appearance, {{colorScheme, dark}, {contrast, 1U}}},
            {interface, {{animations, false}, {textScaling, 1.5}}},
            {accessibility, {{highContrast, true}}}};
}

class AppearanceTest : public testing::Test {
protected:
    ~AppearanceTest() override {
        QDBusConnection::disconnectFromBus(otherName());
        usePalette(Qt::white);
    }

    static QString connectionName() { return QStringLiteral("appearance"); }
    static QString address() { return qEnvironmentVariable("DBUS_SESSION_BUS_ADDRESS"); }
    /// The connection of the appearance, while it has one.
    static QDBusConnection own() { return QDBusConnection(connectionName()); }
    /// Somebody else on the bus.
    const QDBusConnection& other() { return _other; }

    /// Waits until somebody beside `other` has come to the bus.
    void awaitCaller() {
        const auto areTwoThere = [this] {
            const QDBusMessage names = other().call(QDBusMessage::createMethodCall(
                QStringLiteral("org.freedesktop.DBus"), QStringLiteral("/org/freedesktop/DBus"),
                QStringLiteral("org.freedesktop.DBus"), QStringLiteral("ListNames")));
            const auto list = names.arguments().value(0).toStringList();
            return list.filter(QRegularExpression(QStringLiteral("^:"))).size() > 1;
        };
        while (!areTwoThere()) {
            QCoreApplication::processEvents();
        }
    }

    /// Lets arrive what the bus has sent to the appearance.
    static void deliver() {
        EXPECT_TRUE(test::askBus(own()));
        QCoreApplication::processEvents();
    }

    /// Waits until `told` follows the portal, whose first answer changes its text scale.
    static void awaitAnswer(Appearance& told) {
        QSignalSpy scale(&told, &Appearance::textScaleChanged);
        EXPECT_TRUE(scale.wait());
    }

    static QString otherName() { return QStringLiteral("other"); }

    test::PrivateBus _bus;
    QDBusConnection _other = QDBusConnection::connectToBus(address(), otherName());
};

} // namespace

TEST_F(AppearanceTest, WhatTheDesktopSaysArrivesWithTheEventLoop) {
    // Given a desktop on which everything is other than usual
    const PortalStandIn portal(address(), unusual());

    // When the appearance is made
    Appearance told({}, address(), connectionName());

    // Then it waits for nothing
    EXPECT_FALSE(told.isDark());
    EXPECT_FALSE(told.isHighContrast());
    EXPECT_FALSE(told.isMotionReduced());
    EXPECT_EQ(told.textScale(), 1);

    // And follows when the answer is there, to one question, with all values before the first word
    std::optional<bool> wasAllThere;
    QObject::connect(&told, &Appearance::darkChanged, [&] {
        wasAllThere = told.isHighContrast() && told.isMotionReduced() && told.textScale() == 1.5;
    });
    awaitAnswer(told);
    EXPECT_EQ(wasAllThere, true);
    EXPECT_TRUE(told.property("dark").toBool());
    EXPECT_TRUE(told.property("highContrast").toBool());
    EXPECT_TRUE(told.property("reducedMotion").toBool());
    EXPECT_EQ(told.property("textScale").toReal(), 1.5);
    ASSERT_EQ(portal.questions().size(), 1);
    EXPECT_EQ(portal.questions().constFirst(), QStringList({appearance, interface, accessibility}));
}

TEST_F(AppearanceTest, EachChangeIsFollowedAndToldOnce) {
    // Given an appearance that has heard from its desktop
    PortalStandIn portal(address(), {{interface, {{textScaling, 2.0}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);
    QSignalSpy darkness(&told, &Appearance::darkChanged);
    QSignalSpy contrasts(&told, &Appearance::highContrastChanged);
    QSignalSpy motion(&told, &Appearance::reducedMotionChanged);
    QSignalSpy scale(&told, &Appearance::textScaleChanged);

    // When it turns dark
    portal.tell(appearance, colorScheme, dark);
    ASSERT_TRUE(darkness.wait());
    EXPECT_TRUE(told.isDark());
    // Then light
    portal.tell(appearance, colorScheme, light);
    ASSERT_TRUE(darkness.wait());
    EXPECT_FALSE(told.isDark());

    // When contrast goes up, by one setting or both, and down
    portal.tell(appearance, contrast, 1U);
    ASSERT_TRUE(contrasts.wait());
    EXPECT_TRUE(told.isHighContrast());
    portal.tell(accessibility, highContrast, true);
    portal.tell(appearance, contrast, 0U);
    portal.tell(accessibility, highContrast, false);
    ASSERT_TRUE(contrasts.wait());
    EXPECT_FALSE(told.isHighContrast());

    // When motion ends
    portal.tell(interface, animations, false);
    ASSERT_TRUE(motion.wait());
    EXPECT_TRUE(told.isMotionReduced());

    // When texts grow
    portal.tell(interface, textScaling, 1.25);
    ASSERT_TRUE(scale.wait());
    EXPECT_EQ(told.textScale(), 1.25);

    // Then each was told once, and what is as it was is not told
    portal.tell(interface, textScaling, 1.25);
    portal.tell(interface, animations, false);
    deliver();
    EXPECT_EQ(darkness.count(), 2);
    EXPECT_EQ(contrasts.count(), 2);
    EXPECT_EQ(motion.count(), 1);
    EXPECT_EQ(scale.count(), 1);
    EXPECT_EQ(portal.questions().size(), 1);
}

TEST_F(AppearanceTest, VariantsWithinVariantsAreUnwrapped) {
    const auto wrapped = [](const QVariant& value) {
        return QVariant::fromValue(QDBusVariant(QVariant::fromValue(QDBusVariant(value))));
    };
    PortalStandIn portal(address(), {{appearance, {{colorScheme, wrapped(dark)}}},
                                     {interface, {{textScaling, wrapped(0.75)}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);
    EXPECT_TRUE(told.isDark());
    EXPECT_EQ(told.textScale(), 0.75);

    QSignalSpy motion(&told, &Appearance::reducedMotionChanged);
    portal.tell(interface, animations, wrapped(false));
    ASSERT_TRUE(motion.wait());
}

TEST_F(AppearanceTest, ValuesOfTheWrongTypeAreLeftAside) {
    // Given a desktop with one value as it should be among others that are not
    PortalStandIn portal(address(),
                         {{appearance, {{colorScheme, QStringLiteral("dark")}, {contrast, true}}},
                          {interface, {{animations, 0U}, {textScaling, 2.0}}},
                          {accessibility, {{highContrast, 1U}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);
    EXPECT_FALSE(told.isDark());
    EXPECT_FALSE(told.isHighContrast());
    EXPECT_FALSE(told.isMotionReduced());

    // When others of the wrong type follow, and numbers that are none
    portal.tell(appearance, colorScheme, 1);
    portal.tell(appearance, contrast, QStringLiteral("1"));
    portal.tell(interface, animations, QStringLiteral("false"));
    portal.tell(interface, textScaling, QStringLiteral("1.5"));
    portal.tell(interface, textScaling, std::nan(""));
    portal.tell(interface, textScaling, std::numeric_limits<double>::infinity());
    portal.tell(accessibility, highContrast, 1);
    portal.tellNonsense({appearance, colorScheme});
    portal.tellNonsense({appearance, colorScheme, dark});
    portal.tell(interface, colorScheme, dark);
    deliver();

    // Then all stays as it was
    EXPECT_FALSE(told.isDark());
    EXPECT_FALSE(told.isHighContrast());
    EXPECT_FALSE(told.isMotionReduced());
    EXPECT_EQ(told.textScale(), 2);
    // And what is right is still heard
    QSignalSpy darkness(&told, &Appearance::darkChanged);
    portal.tell(appearance, colorScheme, dark);
    ASSERT_TRUE(darkness.wait());
}

TEST_F(AppearanceTest, AnAnswerOfTheWrongTypeIsNoAnswer) {
    // Given a portal that answers with something else
    std::optional<PortalStandIn> portal;
    portal.emplace(address(), unusual());
    portal->answerWith(QStringLiteral("dark"));
    Appearance told({}, address(), connectionName());

    // When another one takes its place
    portal.reset();
    const PortalStandIn later(address(), unusual());

    // Then that is the one that is heard
    awaitAnswer(told);
    EXPECT_TRUE(told.isDark());
}

TEST_F(AppearanceTest, OnlyThePortalIsBelieved) {
    PortalStandIn portal(address(), {{interface, {{textScaling, 2.0}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);

    // When somebody else on the bus says the same as the portal would
    QDBusMessage signal = QDBusMessage::createSignal(
        QStringLiteral("/org/freedesktop/portal/desktop"),
        QStringLiteral("org.freedesktop.portal.Settings"), QStringLiteral("SettingChanged"));
    signal << appearance << colorScheme << QVariant::fromValue(QDBusVariant(dark));
    ASSERT_TRUE(other().send(signal));
    ASSERT_TRUE(test::askBus(other()));
    deliver();

    EXPECT_FALSE(told.isDark());
}

TEST_F(AppearanceTest, TextsStayLegibleAndOnTheScreen) {
    PortalStandIn portal(address(), {{interface, {{textScaling, 20.0}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);
    EXPECT_EQ(told.textScale(), 3);

    QSignalSpy scale(&told, &Appearance::textScaleChanged);
    portal.tell(interface, textScaling, 0.01);
    ASSERT_TRUE(scale.wait());
    EXPECT_EQ(told.textScale(), 0.5);

    const auto scaleOf = [](qreal chosen) {
        return Appearance({.textScale = chosen}, address(), QStringLiteral("chosen")).textScale();
    };
    EXPECT_EQ(scaleOf(7), 3);
    EXPECT_EQ(scaleOf(-1), 0.5);
    EXPECT_EQ(scaleOf(std::nan("")), 1);
}

TEST_F(AppearanceTest, WithoutAPortalThePaletteDecidesOnDark) {
    usePalette(Qt::black);
    Appearance told({}, address(), connectionName());
    EXPECT_TRUE(told.isDark());
    awaitCaller();
    deliver(); // the bus has said by now that there is nobody to ask
    EXPECT_FALSE(told.isHighContrast());
    EXPECT_FALSE(told.isMotionReduced());
    EXPECT_EQ(told.textScale(), 1);

    QSignalSpy darkness(&told, &Appearance::darkChanged);
    usePalette(Qt::white);
    EXPECT_FALSE(told.isDark());
    usePalette(Qt::lightGray);
    EXPECT_EQ(darkness.count(), 1);
    // A portal that comes late is followed.
    const PortalStandIn portal(address(), unusual());
    awaitAnswer(told);
    EXPECT_TRUE(told.isDark());
}

TEST_F(AppearanceTest, ADesktopWithoutAPreferenceLeavesDarkToThePalette) {
    PortalStandIn portal(address(),
                         {{appearance, {{colorScheme, dark}}}, {interface, {{textScaling, 2.0}}}});
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);

    // What the desktop says wins over the palette.
    usePalette(Qt::white);
    EXPECT_TRUE(told.isDark());

    QSignalSpy darkness(&told, &Appearance::darkChanged);
    portal.tell(appearance, colorScheme, none);
    ASSERT_TRUE(darkness.wait());
    EXPECT_FALSE(told.isDark());
    usePalette(Qt::black);
    EXPECT_TRUE(told.isDark());

    // A number that nobody knows says nothing either.
    portal.tell(appearance, colorScheme, light);
    ASSERT_TRUE(darkness.wait());
    portal.tell(appearance, colorScheme, 17U);
    ASSERT_TRUE(darkness.wait());
    EXPECT_TRUE(told.isDark());
}

TEST_F(AppearanceTest, WhatAPortalSaidStaysWhenItVanishes) {
    // Given a dark desktop
    std::optional<PortalStandIn> portal;
    portal.emplace(address(), unusual());
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);

    // When its portal goes
    portal.reset();
    deliver();

    // Then nothing flickers
    EXPECT_TRUE(told.isDark());
    EXPECT_TRUE(told.isHighContrast());
    EXPECT_TRUE(told.isMotionReduced());
    EXPECT_EQ(told.textScale(), 1.5);

    // And a palette that changes is all that can still be known
    usePalette(Qt::white);
    EXPECT_FALSE(told.isDark());
    EXPECT_TRUE(told.isHighContrast());

    // When a portal comes again, what it does not say is as usual again
    const PortalStandIn later(address(), {{appearance, {{colorScheme, dark}}}});
    awaitAnswer(told);
    EXPECT_TRUE(told.isDark());
    EXPECT_FALSE(told.isHighContrast());
    EXPECT_FALSE(told.isMotionReduced());
    EXPECT_EQ(told.textScale(), 1);
}

TEST_F(AppearanceTest, WhatAPortalSaidStaysWhenTheBusEnds) {
    const PortalStandIn portal(address(), unusual());
    Appearance told({}, address(), connectionName());
    awaitAnswer(told);

    _bus.end();
    ASSERT_FALSE(test::askBus(own()));
    QCoreApplication::processEvents();
    EXPECT_TRUE(told.isDark());
    EXPECT_EQ(told.textScale(), 1.5);
    usePalette(Qt::white);
    EXPECT_FALSE(told.isDark());
}

TEST_F(AppearanceTest, WhatTheProgramWasToldWinsAndStays) {
    // Given two things that are chosen, and a desktop that says the opposite
    PortalStandIn portal(address(), unusual());
    Appearance told({.dark = false, .reducedMotion = false}, address(), connectionName());
    awaitAnswer(told);
    EXPECT_FALSE(told.isDark());
    EXPECT_FALSE(told.isMotionReduced());
    EXPECT_TRUE(told.isHighContrast());

    // When the desktop and the palette change
    QSignalSpy darkness(&told, &Appearance::darkChanged);
    portal.tell(appearance, colorScheme, light);
    portal.tell(appearance, colorScheme, dark);
    usePalette(Qt::black);
    deliver();

    // Then what was chosen stays
    EXPECT_FALSE(told.isDark());
    EXPECT_EQ(darkness.count(), 0);
}

} // namespace nimbra::window
