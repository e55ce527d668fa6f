#include "bench/window/MeteredApplication.h"

#include "bench/window/Stopwatch.h"

#include <QEvent>
#include <QWindow>
#include <utility>

namespace nimbra::bench {

bool MeteredApplication::notify(QObject* receiver, QEvent* event) {
    if (event->type() != QEvent::UpdateRequest || qobject_cast<QWindow*>(receiver) == nullptr) {
        return QGuiApplication::notify(receiver, event);
    }
    const Stopwatch frame;
    const bool isTaken = QGuiApplication::notify(receiver, event);
    _frames.push_back(frame.milliseconds());
    return isTaken;
}

std::vector<double> MeteredApplication::takeFrames() {
    return std::exchange(_frames, {});
}

} // namespace nimbra::bench
