#pragma once

#include <QMap>
#include <QObject>
#include <QString>
#include <QVariant>
#include <QVariantMap>
#include <memory>
#include <optional>

class QEvent;

namespace nimbra::window {

class DesktopSettings;

/// How the user wants every window to look. It follows the desktop's settings while it lives, from
/// the portal on the session bus; what no portal says is as Qt knows it: dark where the palette
/// is, with motion, in ordinary contrast and size. The settings arrive with the turns of the event
/// loop: making it waits for no answer. Those of a portal that has gone stay until another one
/// answers; only the palette, where it changes then, decides on dark again. Main thread only, after
/// the application has been made.
class Appearance : public QObject {
    Q_OBJECT
    Q_PROPERTY(bool dark READ isDark NOTIFY darkChanged)
    Q_PROPERTY(bool highContrast READ isHighContrast NOTIFY highContrastChanged)
    Q_PROPERTY(bool reducedMotion READ isMotionReduced NOTIFY reducedMotionChanged)
    Q_PROPERTY(qreal textScale READ textScale NOTIFY textScaleChanged)

public:
    /// What the program was told. It wins over the desktop, and stays as it is.
    struct Choice {
        std::optional<bool> dark;
        std::optional<bool> highContrast;
        std::optional<bool> reducedMotion;
        /// Left aside where it is no finite number.
        std::optional<qreal> textScale;
    };

    /// On the session bus of the process, which is not touched where everything is chosen.
    explicit Appearance(const Choice& choice);
    /// On the bus at the address `bus`, which need not be there; see `DesktopSettings`.
    Appearance(const Choice& choice, const QString& bus, const QString& connection);
    ~Appearance() override;

    [[nodiscard]] bool isDark() const { return _look.dark; }
    [[nodiscard]] bool isHighContrast() const { return _look.highContrast; }
    [[nodiscard]] bool isMotionReduced() const { return _look.reducedMotion; }
    /// How many times their usual size texts are, from 0.5 to 3.
    [[nodiscard]] qreal textScale() const { return _look.textScale; }

    /// Sees the application's palette change.
    bool eventFilter(QObject* watched, QEvent* event) override;

Q_SIGNALS:
    // All four have their new values before the first of these is told.

    void darkChanged();
    void highContrastChanged();
    void reducedMotionChanged();
    void textScaleChanged();

private:
    struct Look {
        bool dark = false;
        bool highContrast = false;
        bool reducedMotion = false;
        qreal textScale = 1;
    };
    /// What the desktop says, as far as it says anything.
    struct Said {
        std::optional<bool> dark;
        bool contrast = false;
        bool accessibilityContrast = false;
        bool reducedMotion = false;
        qreal textScale = 1;
    };

    void follow(const QString& bus, const QString& connection);
    void takeAll(const QMap<QString, QVariantMap>& values);
    void take(const QString& space, const QString& key, const QVariant& value);
    [[nodiscard]] Look currentLook() const;
    void update();

    Choice _choice;
    Said _said;
    Look _look;
    std::unique_ptr<DesktopSettings> _desktop;
};

} // namespace nimbra::window
