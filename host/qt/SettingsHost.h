#pragma once

#include "host/core/scenario/ScenarioSession.h"
#include "host/core/trace/Trace.h"
#include "host/qt/Appearance.h"
#include "host/qt/Arguments.h"
#include "host/qt/HostTexts.h"
#include "host/qt/OpenPanes.h"
#include "host/qt/PaneModel.h"
#include "host/qt/ScreenModel.h"
#include "host/qt/SessionPump.h"
#include "host/qt/SharingModel.h"
#include "host/qt/WindowMetrics.h"

#include <QQmlApplicationEngine>
#include <QQmlComponent>
#include <QString>
#include <expected>
#include <memory>
#include <optional>
#include <string>

class QQuickWindow;

namespace nimbra {
class Specifier;
}
namespace nimbra::host {
class PaneSession;
}

namespace nimbra::window {

/// A window on a device: its session, what it shows of it, and how. Main thread, after the
/// application has been made.
class SettingsHost final : public QObject {
    Q_OBJECT

public:
    /// Makes the window, which is not shown yet. An error is one line that says what cannot be
    /// used.
    [[nodiscard]] static std::expected<std::unique_ptr<SettingsHost>, std::string>
    make(const Arguments& arguments);

    SettingsHost(const SettingsHost&) = delete;
    SettingsHost& operator=(const SettingsHost&) = delete;
    /// Closes the window and the pane, and waits for what they have set going.
    ~SettingsHost() override;

    [[nodiscard]] QQuickWindow& window() { return *_window; }
    [[nodiscard]] host::PaneSession& session() { return *_session; }
    [[nodiscard]] SessionPump& pump() { return *_pump; }
    [[nodiscard]] PaneModel& pane() { return *_pane; }
    [[nodiscard]] ScreenModel& screen() { return *_screen; }
    [[nodiscard]] SharingModel& sharing() { return *_sharing; }
    /// Closes the pane in order, where one is open: for a program that is about to end.
    void closePane();
    /// Null where the window is not driven by a scenario.
    [[nodiscard]] host::ScenarioPlayer* player();

    /// Shows the row that `name` stands for, in the pane, which is opened for it. An error says
    /// which row there is not.
    [[nodiscard]] std::expected<void, std::string> showRow(const std::string& name);

private:
    explicit SettingsHost(const Arguments& arguments);

    [[nodiscard]] std::expected<void, std::string> start(const Arguments& arguments);
    /// Begins what takes long and needs nothing of the device, beside what comes after it.
    void readAhead();
    [[nodiscard]] std::expected<void, std::string> startSession(const Arguments& arguments);
    void makeModels(const Arguments& arguments);
    /// What there is to say of an earlier host that died; empty for nothing.
    [[nodiscard]] QString noticeOfDied();
    [[nodiscard]] std::expected<void, std::string> loadWindow(const Arguments& arguments,
                                                              const QString& notice);
    void watchPane();
    /// Whether the user sees the row of the pane's list.
    [[nodiscard]] bool isRowShown(const Specifier& row);
    [[nodiscard]] QString pictureUrl(const std::string& name) const;

    Appearance _appearance;
    WindowMetrics _metrics;
    OpenPanes _openPanes;
    /// Of a scenario nobody reads it here: it is for programs.
    host::Trace _trace;
    std::unique_ptr<host::ScenarioSession> _scenario;
    std::unique_ptr<host::PaneSession> _ownSession;
    /// One of the two above.
    host::PaneSession* _session = nullptr;
    std::filesystem::path _bundle;
    std::optional<HostTexts> _texts;
    std::optional<SessionPump> _pump;
    std::optional<PaneModel> _pane;
    std::optional<ScreenModel> _screen;
    std::optional<SharingModel> _sharing;
    /// Before all that it shows.
    std::optional<QQmlApplicationEngine> _engine;
    /// The pages, while they are read ahead.
    std::optional<QQmlComponent> _pages;
    /// Null while there is none.
    QQuickWindow* _window = nullptr;
};

} // namespace nimbra::window
