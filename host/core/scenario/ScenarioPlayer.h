#pragma once

#include "host/core/scenario/Scenario.h"

#include <chrono>
#include <cstddef>
#include <expected>
#include <string>

namespace nimbra::device {
class StandingTime;
}

namespace nimbra::host {

class PaneSession;
class RunningApplications;
class Trace;

/// The step that could not be done, and why.
struct StepFailure {
    /// Counted from 0.
    std::size_t index = 0;
    std::string name;
    std::string reason;
};

/// Does the steps of a scenario on a session, one after the other, the way a person would: all with
/// `play`, or each when its time has come, for a host that must not be kept waiting. Main queue.
class ScenarioPlayer {
public:
    /// `session` uses the device that was made from the scenario's description, on which
    /// `applications` run and whose time is `time`, and traces to `trace`. None is owned; all
    /// outlive the player.
    ScenarioPlayer(const Scenario& scenario, PaneSession& session,
                   RunningApplications& applications, device::StandingTime& time, Trace& trace);

    /// Does all steps, or those up to the first that cannot be done, and ends the trace. After each
    /// step it waits until nothing is left to do.
    [[nodiscard]] std::expected<void, StepFailure> play();

    // The same in steps, which the caller takes one after the other; it sees to it that the session
    // settles after each.

    /// Does what of the scenario's device stands in no file; before the first step.
    void begin();
    /// Whether a step is left to do; none after one that could not be done.
    [[nodiscard]] bool hasNext() const;
    /// Does the next step, which there is. It waits for nothing but where the step says so: the
    /// pane has its list when it is open, and what falls due while the time goes by is done.
    [[nodiscard]] std::expected<void, StepFailure> performNext();
    /// Ends the trace: that the session then closes a pane that is still open is no step's doing.
    void end();

private:
    /// Nothing, or why the step could not be done.
    using Outcome = std::expected<void, std::string>;
    struct Handler;

    [[nodiscard]] static const Handler* handlerFor(const std::string& name);
    /// Does what of a description stands in no file of the device directory.
    void applyToSession(const device::GivenDescription& given);
    [[nodiscard]] Outcome perform(const ScenarioStep& step);
    void advanceTo(std::chrono::nanoseconds elapsed);

    Outcome open(const ScenarioStep& step);
    Outcome appear(const ScenarioStep& step);
    Outcome disappear(const ScenarioStep& step);
    Outcome becomeActive(const ScenarioStep& step);
    Outcome list(const ScenarioStep& step);
    Outcome get(const ScenarioStep& step);
    Outcome set(const ScenarioStep& step);
    Outcome tap(const ScenarioStep& step);
    Outcome pullToRefresh(const ScenarioStep& step);
    Outcome post(const ScenarioStep& step);
    Outcome change(const ScenarioStep& step);
    Outcome publishProgress(const ScenarioStep& step);
    Outcome updateProgress(const ScenarioStep& step);
    Outcome unpublishProgress(const ScenarioStep& step);
    Outcome footer(const ScenarioStep& step);
    Outcome moveFooter(const ScenarioStep& step);
    Outcome advance(const ScenarioStep& step);
    Outcome layout(const ScenarioStep& step);
    Outcome views(const ScenarioStep& step);
    Outcome tapButton(const ScenarioStep& step);
    Outcome alert(const ScenarioStep& step);
    Outcome share(const ScenarioStep& step);
    Outcome close(const ScenarioStep& step);

    const Scenario& _scenario;
    PaneSession& _session;
    RunningApplications& _applications;
    device::StandingTime& _time;
    Trace& _trace;
    std::size_t _next = 0;
};

} // namespace nimbra::host
