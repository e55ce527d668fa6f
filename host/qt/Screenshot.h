#pragma once

#include <QImage>
#include <QObject>
#include <QTimer>
#include <expected>
#include <functional>
#include <string>

class QQuickWindow;

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::window {

/// Takes a picture of a window once nothing moves on it any more. Main thread.
class Screenshot final : public QObject {
    Q_OBJECT

public:
    /// Begins to look at `window`, which shows `session`; both outlive it.
    Screenshot(QQuickWindow& window, host::PaneSession& session);

    /// Writes `picture` as PNG to the file `place`. Where that fails, what stood there is left as
    /// it was, and the reason is given.
    [[nodiscard]] static std::expected<void, std::string> save(const QImage& picture,
                                                               const QString& place);

Q_SIGNALS:
    /// Once: the window was the same over some time in which nothing was left to do.
    void taken(const QImage& picture);
    /// Once, instead: something still moved after some twenty seconds.
    void gaveUp();

private:
    void look();

    QQuickWindow& _window;
    host::PaneSession& _session;
    QTimer _timer;
    QImage _last;
    int _equals = 0;
    int _looks = 0;
};

} // namespace nimbra::window
