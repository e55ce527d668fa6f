#pragma once

#include "host/core/scenario/RunningApplications.h"
#include "host/core/scenario/Scenario.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/core/scenario/TemporaryDirectory.h"
#include "host/core/scenario/TerminationGuard.h"
#include "platform/values/Error.h"

#include <expected>
#include <filesystem>
#include <memory>
#include <optional>
#include <string>

namespace nimbra {
class ViewMetrics;
}
namespace nimbra::device {
class StandingTime;
}

namespace nimbra::host {

class PaneSession;
class Trace;

/// A scenario that is ready to be played: with its device, in a directory made for it, what runs
/// there, its own time, which stands still, and a session. Nothing of it stays behind but a
/// directory that is to be kept, also where a signal ends the program: a `TerminationGuard` lives
/// with it. Main thread, which is the main queue's while it lives.
class ScenarioSession {
public:
    struct Configuration {
        /// The scenario's file; "-" for standard input.
        std::string file;
        /// Where the device directory stays behind; nothing for a temporary one.
        std::optional<std::filesystem::path> keep;
        /// As in `PaneSession::Configuration`.
        std::optional<std::filesystem::path> bundle;
        std::optional<std::string> locale;
        bool keepsLogToItself = false;
        ViewMetrics* viewMetrics = nullptr;
    };

    /// Reads the scenario, makes its device, starts the applications that run on it and a session
    /// that traces to `trace`, which is not owned and outlives this object. An error names what
    /// cannot be used.
    [[nodiscard]] static std::expected<std::unique_ptr<ScenarioSession>, Error>
    prepare(const Configuration& configuration, Trace& trace);

    ScenarioSession(const ScenarioSession&) = delete;
    ScenarioSession& operator=(const ScenarioSession&) = delete;
    /// Closes the pane, ends the applications and takes a temporary directory away.
    ~ScenarioSession();

    [[nodiscard]] const Scenario& scenario() const { return _scenario; }
    [[nodiscard]] PaneSession& session() { return *_session; }
    [[nodiscard]] ScenarioPlayer& player() { return *_player; }

private:
    ScenarioSession(Scenario scenario, std::optional<TemporaryDirectory> temporary,
                    const std::filesystem::path& root);

    [[nodiscard]] std::expected<void, Error> start(const Configuration& configuration,
                                                   Trace& trace);
    void putInOrder();

    const Scenario _scenario;
    /// Nothing where the directory is kept.
    const std::optional<TemporaryDirectory> _temporary;
    const std::filesystem::path _root;
    RunningApplications _applications;
    const TerminationGuard _guard;
    std::shared_ptr<device::StandingTime> _time;
    std::unique_ptr<PaneSession> _session;
    std::optional<ScenarioPlayer> _player;
};

} // namespace nimbra::host
