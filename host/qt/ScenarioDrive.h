#pragma once

#include <QObject>
#include <QTimer>

namespace nimbra::window {

class SettingsHost;

/// Plays a scenario in a window as a person would: each step when the one before has been done, and
/// some time to look at it has gone by. Main thread.
class ScenarioDrive final : public QObject {
    Q_OBJECT

public:
    /// The host has a scenario, is not owned, and outlives the drive.
    explicit ScenarioDrive(SettingsHost& host);

Q_SIGNALS:
    /// Once, after the last step. `problem` is one line, empty where all could be done.
    void ended(const QString& problem);

private:
    void goOn();
    /// A step flips switches past the model, which holds what the user has set.
    void showValues();

    SettingsHost& _host;
    QTimer _pause;
    bool _isOver = false;
};

} // namespace nimbra::window
