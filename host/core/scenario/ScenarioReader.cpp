#include "host/core/scenario/ScenarioReader.h"

#include "device/json/JsonReader.h"
#include "host/core/scenario/StepReader.h"

#include <algorithm>
#include <utility>
#include <variant>

namespace nimbra::host {

namespace {

using device::GivenDescription;
using device::JsonReader;

PaneEntry readEntry(const JsonReader& reader, const device::DeviceDescription& device) {
    reader.allowOnly({"account", "firstSetup"});
    PaneEntry entry;
    const JsonReader account = reader.member("account");
    if (!account.isAbsent()) {
        entry.account = account.string();
        const auto isMeant = [&](const auto& known) { return known.identifier == entry.account; };
        if (account.isString() && std::ranges::none_of(device.accounts, isMeant)) {
            account.expected("the identifier of one of the device's accounts");
        }
    }
    const JsonReader firstSetup = reader.member("firstSetup");
    if (firstSetup.isAbsent()) {
        entry.firstSetup = false;
    } else if (firstSetup.isNull()) {
        entry.firstSetup.reset();
    } else if (firstSetup.isBoolean()) {
        entry.firstSetup = firstSetup.boolean();
    } else {
        firstSetup.expected("true, false or null");
    }
    return entry;
}

} // namespace

std::expected<Scenario, Error> readScenario(std::string_view text, const std::string& name) {
    const auto reader = JsonReader::parse(text, name);
    if (!reader) {
        return std::unexpected(reader.error());
    }
    reader->allowOnly({"device", "entry", "steps"});
    Scenario scenario;
    scenario.device = device::readScenarioDevice(reader->member("device"));
    scenario.entry = readEntry(reader->member("entry"), scenario.device.description);

    const JsonReader steps = reader->member("steps");
    if (steps.isAbsent()) {
        steps.expected("an array of steps");
    }
    for (const JsonReader& element : steps.elements()) {
        scenario.steps.push_back(readStep(element));
    }
    if (auto problem = reader->problem()) {
        return std::unexpected(std::move(*problem));
    }
    return scenario;
}

} // namespace nimbra::host
