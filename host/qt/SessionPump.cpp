#include "host/qt/SessionPump.h"

#include "host/core/PaneSession.h"

namespace nimbra::window {

SessionPump::SessionPump(host::PaneSession& session)
    : _session(session), _work(session.loop().wakeUpDescriptor(), QSocketNotifier::Read) {
    connect(&_work, &QSocketNotifier::activated, this, &SessionPump::run);
}

void SessionPump::run() {
    _session.runPending();
    Q_EMIT ran();
}

} // namespace nimbra::window
