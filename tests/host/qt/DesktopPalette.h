#pragma once

#include <QColor>
#include <QCoreApplication>
#include <QEvent>
#include <QGuiApplication>
#include <QPalette>

namespace nimbra::test {

/// Gives windows the colour `window`, as the platform does it while the application runs.
inline void usePalette(const QColor& window) {
    QPalette palette;
    palette.setColor(QPalette::Window, window);
    QGuiApplication::setPalette(palette);
    QEvent change(QEvent::ApplicationPaletteChange);
    QCoreApplication::sendEvent(qGuiApp, &change);
}

} // namespace nimbra::test
