#pragma once

#include <QObject>
#include <QSocketNotifier>

namespace nimbra::host {
class PaneSession;
}

namespace nimbra::window {

/// Runs the main queue of a session, which outlives the pump, whenever there is work in it, as a
/// part of the window's own event loop. Main thread, which is the main queue's.
class SessionPump final : public QObject {
    Q_OBJECT

public:
    explicit SessionPump(host::PaneSession& session);

    /// Runs what is queued now.
    void run();

Q_SIGNALS:
    /// The main queue has had a turn: anything that the session shows may be another.
    void ran();

private:
    host::PaneSession& _session;
    QSocketNotifier _work;
};

} // namespace nimbra::window
