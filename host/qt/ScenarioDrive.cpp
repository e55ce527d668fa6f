#include "host/qt/ScenarioDrive.h"

#include "host/core/PaneSession.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/qt/SettingsHost.h"
#include "host/qt/Strings.h"

#include <chrono>

namespace nimbra::window {

ScenarioDrive::ScenarioDrive(SettingsHost& host) : _host(host) {
    // As long as a look takes.
    _pause.setInterval(std::chrono::milliseconds(700));
    connect(&_pause, &QTimer::timeout, this, &ScenarioDrive::goOn);
    _host.player()->begin();
    _pause.start();
}

void ScenarioDrive::showValues() {
    _host.pane().rows()->rows().readAnew();
}

void ScenarioDrive::goOn() {
    if (!_host.session().isSettled() || _isOver) {
        return;
    }
    showValues();
    QString problem;
    if (_host.player()->hasNext()) {
        const auto done = _host.player()->performNext();
        _host.pump().run();
        showValues();
        if (done) {
            return;
        }
        const host::StepFailure& failure = done.error();
        problem = qString("step " + std::to_string(failure.index) + " (" + failure.name +
                          "): " + failure.reason);
    }
    _isOver = true;
    _pause.stop();
    Q_EMIT ended(problem);
}

} // namespace nimbra::window
