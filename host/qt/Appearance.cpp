#include "host/qt/Appearance.h"

#include "host/qt/DesktopSettings.h"

#include <QColor>
#include <QEvent>
#include <QGuiApplication>
#include <QMetaType>
#include <QPalette>
#include <QStringList>
#include <algorithm>
#include <cmath>
#include <utility>

namespace nimbra::window {

namespace {

const QString& appearanceSpace() {
    static const QString name = QStringLiteral("org.freedesktop.appearance");
    return name;
}

const QString& interfaceSpace() {
    static const QString name = QStringLiteral("org.gnome.desktop.interface");
    return name;
}

const QString& accessibilitySpace() {
    static const QString name = QStringLiteral("org.gnome.desktop.a11y.interface");
    return name;
}

constexpr uint darkScheme = 1;
constexpr uint lightScheme = 2;
constexpr uint moreContrast = 1;

constexpr qreal smallestScale = 0.5;
constexpr qreal largestScale = 3;

/// `value`, where it is of this type and no other that could be made into it.
template <typename T>
std::optional<T> exactly(const QVariant& value) {
    if (value.metaType() != QMetaType::fromType<T>()) {
        return std::nullopt;
    }
    return value.value<T>();
}

/// `scale` as a text can have it; nothing where it is no number at all.
std::optional<qreal> usableScale(std::optional<qreal> scale) {
    if (!scale || !std::isfinite(*scale)) {
        return std::nullopt;
    }
    return std::clamp(*scale, smallestScale, largestScale);
}

bool isPaletteDark() {
    constexpr int middle = 128;
    return QGuiApplication::palette().color(QPalette::Window).lightness() < middle;
}

/// What a colour scheme of the desktop says; a number that is not known says nothing.
std::optional<bool> isSchemeDark(uint scheme) {
    if (scheme != darkScheme && scheme != lightScheme) {
        return std::nullopt;
    }
    return scheme == darkScheme;
}

bool isAllChosen(const Appearance::Choice& choice) {
    return choice.dark && choice.highContrast && choice.reducedMotion &&
           usableScale(choice.textScale);
}

} // namespace

Appearance::Appearance(const Choice& choice)
    : Appearance(choice, DesktopSettings::sessionBus(), QStringLiteral("desktop-settings")) {}

Appearance::Appearance(const Choice& choice, const QString& bus, const QString& connection)
    : _choice(choice), _look(currentLook()) {
    if (!isAllChosen(choice)) {
        follow(bus, connection);
    }
}

Appearance::~Appearance() = default;

void Appearance::follow(const QString& bus, const QString& connection) {
    qGuiApp->installEventFilter(this);
    _desktop = std::make_unique<DesktopSettings>(
        bus, connection, QStringList{appearanceSpace(), interfaceSpace(), accessibilitySpace()});
    connect(_desktop.get(), &DesktopSettings::answered, this, &Appearance::takeAll);
    connect(_desktop.get(), &DesktopSettings::changed, this,
            [this](const QString& space, const QString& key, const QVariant& value) {
                take(space, key, value);
                update();
            });
}

bool Appearance::eventFilter(QObject* watched, QEvent* event) {
    if (event->type() == QEvent::ApplicationPaletteChange) {
        if (!_desktop->isThere()) {
            _said.dark.reset();
        }
        update();
    }
    return QObject::eventFilter(watched, event);
}

void Appearance::takeAll(const QMap<QString, QVariantMap>& values) {
    _said = {};
    for (auto space = values.cbegin(); space != values.cend(); ++space) {
        for (auto value = space->cbegin(); value != space->cend(); ++value) {
            take(space.key(), value.key(), value.value());
        }
    }
    update();
}

void Appearance::take(const QString& space, const QString& key, const QVariant& value) {
    if (space == appearanceSpace() && key == QStringLiteral("color-scheme")) {
        if (const auto scheme = exactly<uint>(value)) {
            _said.dark = isSchemeDark(*scheme);
        }
    } else if (space == appearanceSpace() && key == QStringLiteral("contrast")) {
        if (const auto contrast = exactly<uint>(value)) {
            _said.contrast = *contrast == moreContrast;
        }
    } else if (space == accessibilitySpace() && key == QStringLiteral("high-contrast")) {
        _said.accessibilityContrast = exactly<bool>(value).value_or(_said.accessibilityContrast);
    } else if (space == interfaceSpace() && key == QStringLiteral("enable-animations")) {
        _said.reducedMotion = !exactly<bool>(value).value_or(!_said.reducedMotion);
    } else if (space == interfaceSpace() && key == QStringLiteral("text-scaling-factor")) {
        _said.textScale = usableScale(exactly<double>(value)).value_or(_said.textScale);
    }
}

Appearance::Look Appearance::currentLook() const {
    const std::optional<bool> isDark = _choice.dark ? _choice.dark : _said.dark;
    // Not every desktop has both settings of contrast: who is in need of it has found one of them.
    const bool isContrastHigh = _said.contrast || _said.accessibilityContrast;
    return {.dark = isDark ? *isDark : isPaletteDark(),
            .highContrast = _choice.highContrast.value_or(isContrastHigh),
            .reducedMotion = _choice.reducedMotion.value_or(_said.reducedMotion),
            .textScale = usableScale(_choice.textScale).value_or(_said.textScale)};
}

void Appearance::update() {
    const Look earlier = std::exchange(_look, currentLook());
    if (_look.dark != earlier.dark) {
        Q_EMIT darkChanged();
    }
    if (_look.highContrast != earlier.highContrast) {
        Q_EMIT highContrastChanged();
    }
    if (_look.reducedMotion != earlier.reducedMotion) {
        Q_EMIT reducedMotionChanged();
    }
    if (_look.textScale != earlier.textScale) {
        Q_EMIT textScaleChanged();
    }
}

} // namespace nimbra::window
