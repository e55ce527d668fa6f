#pragma once

#include "host/qt/DrawnViews.h"

#include <QObject>
#include <QString>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::window {

class SessionPump;

/// The screen that a pane has presented over itself: its bar, and its views where the page has put
/// them. Main queue.
class ScreenModel final : public QObject {
    Q_OBJECT
    Q_PROPERTY(nimbra::window::DrawnViews* views READ views CONSTANT)
    Q_PROPERTY(bool isShown MEMBER _isShown NOTIFY isShownChanged)
    Q_PROPERTY(QString title MEMBER _title NOTIFY changed)
    Q_PROPERTY(bool hasCancel MEMBER _hasCancel NOTIFY changed)
    /// How high what can be scrolled to is, in points.
    Q_PROPERTY(qreal contentHeight MEMBER _contentHeight NOTIFY changed)

public:
    /// The session and its pump outlive the model.
    ScreenModel(host::PaneSession& session, SessionPump& pump, DrawnViews::Look look);

    /// Gives the screen its size, in points.
    Q_INVOKABLE void setSize(qreal width, qreal height);
    /// Touches the button of this title, or that of the bar; nothing where the user could not now.
    Q_INVOKABLE void touch(const QString& button);
    Q_INVOKABLE void cancel();

    [[nodiscard]] DrawnViews* views() { return &_views; }

Q_SIGNALS:
    void changed();
    /// After all else has been told.
    void isShownChanged();

private:
    void update();
    void layOut();

    host::PaneSession& _session;
    SessionPump& _pump;
    DrawnViews _views;
    qreal _width = 0;
    qreal _height = 0;
    bool _isShown = false;
    QString _title;
    bool _hasCancel = false;
    qreal _contentHeight = 0;
};

} // namespace nimbra::window
