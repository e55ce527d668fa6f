#include "host/core/scenario/ScenarioSession.h"

#include "device/DeviceDirectory.h"
#include "device/files/Files.h"
#include "device/system/StandingTime.h"
#include "host/core/BundleSearch.h"
#include "host/core/PaneSession.h"
#include "host/core/scenario/ScenarioReader.h"

#include <utility>

namespace nimbra::host {

namespace {

std::expected<Scenario, Error> readScenarioFrom(const std::string& file) {
    const bool isStandardInput = file == "-";
    const auto text = isStandardInput ? device::readStandardInput() : device::readFile(file);
    if (!text) {
        return std::unexpected(text.error());
    }
    return readScenario(*text, isStandardInput ? "standard input" : file);
}

} // namespace

std::expected<std::unique_ptr<ScenarioSession>, Error>
ScenarioSession::prepare(const Configuration& configuration, Trace& trace) {
    auto scenario = readScenarioFrom(configuration.file);
    if (!scenario) {
        return std::unexpected(std::move(scenario.error()));
    }
    std::optional<TemporaryDirectory> temporary;
    if (!configuration.keep) {
        auto made = TemporaryDirectory::make();
        if (!made) {
            return std::unexpected(std::move(made.error()));
        }
        temporary.emplace(std::move(*made));
    }
    const std::filesystem::path root =
        configuration.keep ? *configuration.keep : temporary->path() / "device";
    std::unique_ptr<ScenarioSession> prepared(
        new ScenarioSession(std::move(*scenario), std::move(temporary), root));
    if (auto started = prepared->start(configuration, trace); !started) {
        return std::unexpected(std::move(started.error()));
    }
    return prepared;
}

ScenarioSession::ScenarioSession(Scenario scenario, std::optional<TemporaryDirectory> temporary,
                                 const std::filesystem::path& root)
    : _scenario(std::move(scenario)), _temporary(std::move(temporary)), _root(root),
      _applications(root), _guard([this] { putInOrder(); }) {}

ScenarioSession::~ScenarioSession() = default;

std::expected<void, Error> ScenarioSession::start(const Configuration& configuration,
                                                  Trace& trace) {
    const device::DeviceDescription& description = _scenario.device.description;
    if (auto made = device::createDeviceDirectory(_root, description, findDeviceParts()); !made) {
        return made;
    }
    if (auto running = _applications.setRunning(description.runningApplications()); !running) {
        return running;
    }
    _time = std::make_shared<device::StandingTime>(description.now);
    auto session = PaneSession::start({.root = _root,
                                       .bundle = configuration.bundle,
                                       .locale = configuration.locale,
                                       .trace = &trace,
                                       .timeSource = _time,
                                       .keepsLogToItself = configuration.keepsLogToItself,
                                       .viewMetrics = configuration.viewMetrics});
    if (!session) {
        return std::unexpected(std::move(session.error()));
    }
    _session = std::move(*session);
    _player.emplace(_scenario, *_session, _applications, *_time, trace);
    return {};
}

void ScenarioSession::putInOrder() {
    _applications.end();
    if (_temporary) {
        _temporary->remove();
    }
}

} // namespace nimbra::host
