#include "host/cli/PlayCommand.h"

#include "device/DeviceDirectory.h"
#include "device/files/Files.h"
#include "device/system/StandingTime.h"
#include "host/core/BundleSearch.h"
#include "host/core/PaneSession.h"
#include "host/core/scenario/RunningApplications.h"
#include "host/core/scenario/ScenarioPlayer.h"
#include "host/core/scenario/ScenarioReader.h"
#include "host/core/scenario/TemporaryDirectory.h"
#include "host/core/scenario/TerminationGuard.h"
#include "host/core/trace/Trace.h"

#include <iostream>
#include <iterator>
#include <memory>

namespace nimbra::cli {

namespace {

std::unexpected<Failure> badInput(const Error& error) {
    return std::unexpected(Failure{exitBadInput, error.description});
}

std::expected<host::Scenario, Error> readScenario(const std::string& file) {
    if (file == "-") {
        const std::string text(std::istreambuf_iterator<char>(std::cin), {});
        return host::readScenario(text, "standard input");
    }
    const auto text = device::readFile(file);
    if (!text) {
        return std::unexpected(text.error());
    }
    return host::readScenario(*text, file);
}

std::expected<void, Failure> playOn(const std::filesystem::path& root,
                                    host::RunningApplications& applications,
                                    const host::Scenario& scenario, const PlayOptions& options,
                                    std::ostream& out) {
    if (const auto made = device::createDeviceDirectory(root, scenario.device.description,
                                                        host::findDeviceParts());
        !made) {
        return badInput(made.error());
    }
    const auto running = applications.setRunning(scenario.device.description.runningApplications());
    if (!running) {
        return badInput(running.error());
    }
    host::Trace trace([&out](const std::string& line) { out << line << '\n' << std::flush; });
    const auto time = std::make_shared<device::StandingTime>(scenario.device.description.now);
    const auto session = host::PaneSession::start({.root = root,
                                                   .bundle = options.bundle,
                                                   .locale = options.locale,
                                                   .trace = &trace,
                                                   .timeSource = time});
    if (!session) {
        return badInput(session.error());
    }
    if (const auto played =
            host::ScenarioPlayer(scenario, **session, applications, *time, trace).play();
        !played) {
        const host::StepFailure& failure = played.error();
        return std::unexpected(Failure{exitRefused, "step " + std::to_string(failure.index) + " (" +
                                                        failure.name + "): " + failure.reason});
    }
    return {};
}

} // namespace

std::expected<void, Failure> play(const PlayOptions& options, std::ostream& out) {
    const auto scenario = readScenario(options.scenario);
    if (!scenario) {
        return badInput(scenario.error());
    }
    if (options.keep) {
        host::RunningApplications applications(*options.keep);
        const host::TerminationGuard guard([&applications] { applications.end(); });
        return playOn(*options.keep, applications, *scenario, options, out);
    }
    const auto temporary = host::TemporaryDirectory::make();
    if (!temporary) {
        return badInput(temporary.error());
    }
    const std::filesystem::path root = temporary->path() / "device";
    host::RunningApplications applications(root);
    const host::TerminationGuard guard([&applications, &temporary] {
        applications.end();
        temporary->remove();
    });
    return playOn(root, applications, *scenario, options, out);
}

} // namespace nimbra::cli
