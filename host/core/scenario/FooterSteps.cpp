// The steps of a scenario that concern the status footer and what it follows: the sync's progress
// and the time.
#include "device/DevicePlatform.h"
#include "device/documents/DeviceDaemonConnection.h"
#include "device/documents/ProgressPublisher.h"
#include "device/system/StandingTime.h"
#include "host/core/FooterDescription.h"
#include "host/core/PaneSession.h"
#include "host/core/RowDescription.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/core/trace/Trace.h"

#include <array>
#include <charconv>
#include <string>
#include <utility>
#include <variant>

namespace nimbra::host {

namespace {

/// Of the numbers that a bar cannot tell from `progress`, the one that reads shortest.
double readable(float progress) {
    std::array<char, 32> digits{};
    const auto written = std::to_chars(digits.data(), digits.data() + digits.size(), progress);
    double value = progress;
    std::from_chars(digits.data(), written.ptr, value);
    return value;
}

constexpr const char* noFooter = "the page shows no status footer";

std::expected<void, std::string> outcomeOf(const std::expected<void, Error>& result) {
    if (!result) {
        return std::unexpected(result.error().description);
    }
    return {};
}

} // namespace

ScenarioPlayer::Outcome ScenarioPlayer::publishProgress(const ScenarioStep& step) {
    const auto& arguments = std::get<ProgressArguments>(step.arguments);
    return outcomeOf(_session.device().progressPublisher().publish(
        arguments.id, _session.device().daemonConnection().mobileDocumentsURL(),
        arguments.changes.values));
}

ScenarioPlayer::Outcome ScenarioPlayer::updateProgress(const ScenarioStep& step) {
    const auto& arguments = std::get<ProgressArguments>(step.arguments);
    return outcomeOf(_session.device().progressPublisher().update(arguments.id, arguments.changes));
}

ScenarioPlayer::Outcome ScenarioPlayer::unpublishProgress(const ScenarioStep& step) {
    return outcomeOf(_session.device().progressPublisher().unpublish(
        std::get<ProgressArguments>(step.arguments).id));
}

ScenarioPlayer::Outcome ScenarioPlayer::footer(const ScenarioStep& /*step*/) {
    const auto view = _session.footers().first();
    if (!view) {
        return std::unexpected(noFooter);
    }
    const FooterDescription footer = FooterDescription::of(*view);
    _trace.write("footer", {{"syncing", footer.syncing},
                            {"barHidden", footer.barHidden},
                            {"barProgress", readable(footer.barProgress)},
                            {"text", jsonOf(footer.text)},
                            {"height", footer.height},
                            {"lineHeight", footer.lineHeight},
                            {"barHeight", footer.barHeight},
                            {"timerRunning", footer.timerRunning},
                            {"subscribed", footer.subscribed}});
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::moveFooter(const ScenarioStep& step) {
    if (!_session.footers().first()) {
        return std::unexpected(noFooter);
    }
    _session.footers().moveFirst(std::get<MoveFooterArguments>(step.arguments).window);
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::advance(const ScenarioStep& step) {
    advanceTo(_time.elapsed() + std::get<AdvanceArguments>(step.arguments).duration);
    return {};
}

void ScenarioPlayer::advanceTo(std::chrono::nanoseconds elapsed) {
    // From deadline to deadline: a handler may set a timer that falls due before the end.
    for (auto next = _time.nextDeadline(); next && *next <= elapsed; next = _time.nextDeadline()) {
        _time.advanceTo(*next);
        _session.settle();
    }
    _time.advanceTo(elapsed);
}

} // namespace nimbra::host
