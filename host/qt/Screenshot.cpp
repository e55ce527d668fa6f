#include "host/qt/Screenshot.h"

#include "host/core/PaneSession.h"

#include <QBuffer>
#include <QFileInfo>
#include <QQuickWindow>
#include <QSaveFile>
#include <QString>
#include <chrono>
#include <utility>

namespace nimbra::window {

Screenshot::Screenshot(QQuickWindow& window, host::PaneSession& session)
    : _window(window), _session(session) {
    // Longer than the pause between any two frames of what moves.
    _timer.setInterval(std::chrono::milliseconds(80));
    connect(&_timer, &QTimer::timeout, this, &Screenshot::look);
    _timer.start();
}

std::expected<void, std::string> Screenshot::save(const QImage& picture, const QString& place) {
    QBuffer png;
    if (!png.open(QIODevice::WriteOnly) || !picture.save(&png, "PNG")) {
        return std::unexpected("no memory for the picture");
    }
    // The file takes the place of what stands there, also of a device.
    if (const QFileInfo earlier(place); earlier.exists() && !earlier.isFile()) {
        return std::unexpected("is not a plain file");
    }
    QSaveFile file(place);
    // What is still to be written when it commits may get lost without a word.
    if (!file.open(QIODevice::WriteOnly) || file.write(png.data()) != png.size() || !file.flush() ||
        !file.commit()) {
        return std::unexpected(file.errorString().toStdString());
    }
    return {};
}

void Screenshot::look() {
    constexpr int enough = 3;
    constexpr int tooMany = 250;
    const QImage picture = _window.grabWindow();
    const QImage last = std::exchange(_last, picture);
    _equals = _session.isSettled() && picture == last ? _equals + 1 : 0;
    if (_equals == enough) {
        _timer.stop();
        Q_EMIT taken(picture);
    } else if (++_looks == tooMany) {
        _timer.stop();
        Q_EMIT gaveUp();
    }
}

} // namespace nimbra::window
