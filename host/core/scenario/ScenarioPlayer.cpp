#include "host/core/scenario/ScenarioPlayer.h"

#include "device/DeviceDirectory.h"
#include "device/DevicePlatform.h"
#include "device/bundles/DeviceBundles.h"
#include "device/documents/DeviceFileManager.h"
#include "device/store/DeviceAccountStore.h"
#include "device/store/DevicePrivacyConsentStore.h"
#include "device/system/DeviceProcesses.h"
#include "device/system/DeviceSettings.h"
#include "device/system/StandingTime.h"
#include "host/core/BundleSearch.h"
#include "host/core/PaneSession.h"
#include "host/core/RowDescription.h"
#include "host/core/scenario/RunningApplications.h"
#include "host/core/trace/Trace.h"

#include <algorithm>
#include <array>
#include <string_view>
#include <thread>
#include <utility>
#include <variant>

namespace nimbra::host {

/// How a step is done.
struct ScenarioPlayer::Handler {
    std::string_view name;
    Outcome (ScenarioPlayer::*perform)(const ScenarioStep& step) = nullptr;
    bool needsPane = false;
};

const ScenarioPlayer::Handler* ScenarioPlayer::handlerFor(const std::string& name) {
    static constexpr std::array handlers{
        Handler{.name = "open", .perform = &ScenarioPlayer::open},
        Handler{.name = "appear", .perform = &ScenarioPlayer::appear, .needsPane = true},
        Handler{.name = "disappear", .perform = &ScenarioPlayer::disappear, .needsPane = true},
        Handler{.name = "becomeActive", .perform = &ScenarioPlayer::becomeActive},
        Handler{.name = "list", .perform = &ScenarioPlayer::list, .needsPane = true},
        Handler{.name = "get", .perform = &ScenarioPlayer::get, .needsPane = true},
        Handler{.name = "set", .perform = &ScenarioPlayer::set, .needsPane = true},
        Handler{.name = "tap", .perform = &ScenarioPlayer::tap, .needsPane = true},
        Handler{
            .name = "pullToRefresh", .perform = &ScenarioPlayer::pullToRefresh, .needsPane = true},
        Handler{.name = "post", .perform = &ScenarioPlayer::post},
        Handler{.name = "change", .perform = &ScenarioPlayer::change},
        Handler{.name = "close", .perform = &ScenarioPlayer::close, .needsPane = true},
        Handler{.name = "publishProgress", .perform = &ScenarioPlayer::publishProgress},
        Handler{.name = "updateProgress", .perform = &ScenarioPlayer::updateProgress},
        Handler{.name = "unpublishProgress", .perform = &ScenarioPlayer::unpublishProgress},
        Handler{.name = "footer", .perform = &ScenarioPlayer::footer, .needsPane = true},
        Handler{.name = "moveFooter", .perform = &ScenarioPlayer::moveFooter, .needsPane = true},
        Handler{.name = "advance", .perform = &ScenarioPlayer::advance},
        Handler{.name = "layout", .perform = &ScenarioPlayer::layout},
        Handler{.name = "views", .perform = &ScenarioPlayer::views},
        Handler{.name = "tapButton", .perform = &ScenarioPlayer::tapButton},
        Handler{.name = "alert", .perform = &ScenarioPlayer::alert},
        Handler{.name = "share", .perform = &ScenarioPlayer::share},
    };
    const auto* const handler = std::ranges::find(handlers, name, &Handler::name);
    return handler != handlers.end() ? handler : nullptr;
}

ScenarioPlayer::ScenarioPlayer(const Scenario& scenario, PaneSession& session,
                               RunningApplications& applications, device::StandingTime& time,
                               Trace& trace)
    : _scenario(scenario), _session(session), _applications(applications), _time(time),
      _trace(trace) {}

std::expected<void, StepFailure> ScenarioPlayer::play() {
    begin();
    std::expected<void, StepFailure> result;
    while (result && hasNext()) {
        result = performNext();
        _session.settle();
    }
    end();
    return result;
}

void ScenarioPlayer::begin() {
    applyToSession(_scenario.device);
}

bool ScenarioPlayer::hasNext() const {
    return _next < _scenario.steps.size();
}

std::expected<void, StepFailure> ScenarioPlayer::performNext() {
    const std::size_t index = _next++;
    const ScenarioStep& step = _scenario.steps[index];
    _trace.write("step", {{"index", index}, {"do", step.name}});
    if (const Outcome outcome = perform(step); !outcome) {
        _next = _scenario.steps.size();
        return std::unexpected(StepFailure{index, step.name, outcome.error()});
    }
    return {};
}

void ScenarioPlayer::end() {
    _trace.end();
}

void ScenarioPlayer::applyToSession(const device::GivenDescription& given) {
    if (given.description.strings) {
        _session.replaceTexts(*given.description.strings);
    }
    if (given.keys.contains("paneBundleRegistered")) {
        _session.device().bundles().setFindable(BundleIdentifier("com.vantrel.NimbraDriveSettings"),
                                                given.description.paneBundleRegistered);
    }
    if (given.keys.contains("now")) {
        _time.setNow(given.description.now);
    }
    if (given.keys.contains("faults")) {
        _session.device().accountStore().planSaveOutcomes(given.description.saveFaults);
        _session.device().privacyConsentStore().planSetOutcomes(given.description.consentSetFaults);
        _session.device().fileManager().planRemoveOutcomes(given.description.removeItemFaults);
        _session.device().fileManager().planCreateOutcomes(given.description.createDirectoryFaults);
        _session.device().processes().planSpawnOutcomes(given.description.spawnFaults);
    }
}

ScenarioPlayer::Outcome ScenarioPlayer::perform(const ScenarioStep& step) {
    const Handler* handler = handlerFor(step.name);
    if (handler == nullptr) {
        return std::unexpected("this version does not know the step");
    }
    if (handler->needsPane && !_session.isPaneOpen()) {
        return std::unexpected("no page is open");
    }
    return (this->*handler->perform)(step);
}

ScenarioPlayer::Outcome ScenarioPlayer::open(const ScenarioStep& step) {
    if (_session.isPaneOpen()) {
        return std::unexpected("the page is open already");
    }
    if (const auto opened = _session.openPane(_scenario.entry); !opened) {
        return std::unexpected(opened.error().description);
    }
    _session.settle();
    return list(step);
}

ScenarioPlayer::Outcome ScenarioPlayer::appear(const ScenarioStep& /*step*/) {
    _session.appear();
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::disappear(const ScenarioStep& /*step*/) {
    _session.disappear();
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::becomeActive(const ScenarioStep& /*step*/) {
    _session.becomeActive();
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::list(const ScenarioStep& /*step*/) {
    auto rows = nlohmann::ordered_json::array();
    for (const RowDescription& row : RowDescription::of(_session.rows())) {
        rows.push_back(row.json());
    }
    _trace.write("list", {{"rows", std::move(rows)}});
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::get(const ScenarioStep& step) {
    const auto row = _session.row(std::get<RowArgument>(step.arguments).row);
    if (!row) {
        return std::unexpected(row.error().explanation);
    }
    _trace.write("value", {{"row", jsonOf((*row)->label())}, {"value", jsonOf((*row)->value())}});
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::set(const ScenarioStep& step) {
    const auto& arguments = std::get<SetArguments>(step.arguments);
    if (const auto done = _session.setRow(arguments.row, arguments.value); !done) {
        return std::unexpected(done.error().explanation);
    }
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::tap(const ScenarioStep& step) {
    const auto done = _session.tapRow(std::get<RowArgument>(step.arguments).row);
    if (!done) {
        return std::unexpected(done.error().explanation);
    }
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::pullToRefresh(const ScenarioStep& /*step*/) {
    _session.pullToRefresh();
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::post(const ScenarioStep& step) {
    const auto& arguments = std::get<PostArguments>(step.arguments);
    const auto post = [&] {
        if (arguments.distributed) {
            _session.postDistributed(arguments.notification);
        } else {
            _session.post(arguments.notification);
        }
    };
    if (arguments.fromOtherThread) {
        std::thread(post).join();
    } else {
        post();
    }
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::change(const ScenarioStep& step) {
    const device::GivenDescription& change = std::get<ChangeArguments>(step.arguments).device;
    if (const auto changed =
            device::changeDeviceDirectory(_session.root(), change, findDeviceParts());
        !changed) {
        return std::unexpected(changed.error().description);
    }
    if (const auto reloaded = _session.device().settings().reload(); !reloaded) {
        return std::unexpected(reloaded.error().description);
    }
    if (change.keys.contains("apps")) {
        const auto running = _applications.setRunning(change.description.runningApplications());
        if (!running) {
            return std::unexpected(running.error().description);
        }
    }
    applyToSession(change);
    return {};
}

ScenarioPlayer::Outcome ScenarioPlayer::close(const ScenarioStep& /*step*/) {
    _session.closePane();
    return {};
}

} // namespace nimbra::host
