#include "device/description/DescriptionFiles.h"

#include "device/description/DescriptionParts.h"
#include "device/description/DescriptionValues.h"
#include "device/description/MachineFacts.h"
#include "device/files/Files.h"
#include "device/files/PlainFile.h"
#include "device/json/JsonReader.h"

#include <algorithm>
#include <array>
#include <filesystem>
#include <system_error>

namespace nimbra::device {

namespace {

using Json = nlohmann::ordered_json;
using DeviceList = DeviceDescription::DeviceList;

struct NamedOutcome {
    std::string_view name;
    DeviceList::Outcome outcome;
};
constexpr std::array outcomes{NamedOutcome{"answers", DeviceList::Outcome::answers},
                              NamedOutcome{"fails", DeviceList::Outcome::fails},
                              NamedOutcome{"never answers", DeviceList::Outcome::neverAnswers}};

void readDevice(const JsonReader& reader, DeviceDescription& description) {
    reader.allowOnly({"name", "idiom", "screen", "locale", "timeZone", "abilities"});
    readDeviceFacts(reader, description);
    const JsonReader abilities = reader.member("abilities");
    abilities.allowOnly({"cellularData", "wirelessVariant"});
    readAbilities(abilities, description);
}

DeviceList::Outcome readOutcome(const JsonReader& reader) {
    const std::string name =
        readOneOf(reader, {outcomes[0].name, outcomes[1].name, outcomes[2].name});
    const auto* const named = std::ranges::find(outcomes, name, &NamedOutcome::name);
    return named != outcomes.end() ? named->outcome : DeviceList::Outcome::answers;
}

void readDeviceListFile(const JsonReader& reader, DeviceDescription& description) {
    reader.allowOnly({"incompatible", "needUpgrade", "outcome", "delay"});
    readDeviceNames(reader, description);
    if (const JsonReader outcome = reader.member("outcome"); !outcome.isAbsent()) {
        description.deviceList.outcome = readOutcome(outcome);
    }
    const JsonReader delay = reader.member("delay");
    description.deviceList.delay = delay.number();
    if (description.deviceList.delay < 0) {
        delay.expected("a number of seconds, 0 or above");
    }
}

Json orNull(const std::optional<std::string>& text) {
    return text ? Json(*text) : Json(nullptr);
}

Json deviceContent(const DeviceDescription& description) {
    Json screen;
    if (description.screen) {
        screen = Json{{"width", description.screen->width},
                      {"height", description.screen->height},
                      {"scale", description.screen->scale}};
    }
    return Json{{"name", description.name},
                {"idiom", description.idiom},
                {"screen", screen},
                {"locale", description.locale},
                {"timeZone", description.timeZone},
                {"abilities", Json{{"cellularData", description.cellularData},
                                   {"wirelessVariant", orNull(description.wirelessVariant)}}}};
}

Json restrictionsContent(const DeviceDescription& description) {
    return Json{
        {"cloudSyncDenied", description.cloudSyncDenied},
        {"appCellularDataModificationAllowed", description.appCellularDataModificationAllowed}};
}

Json documentsContent(const DeviceDescription& description) {
    Json containers = Json::array();
    for (const DeviceDescription::Container& container : description.containers) {
        containers.push_back(Json{{"identifier", container.identifier},
                                  {"public", container.isPublic},
                                  {"registrationFails", container.registrationFails}});
    }
    Json content{{"identity", orNull(description.identity)},
                 {"containers", containers},
                 {"lastSyncDate", description.lastSyncDate}};
    if (!description.composesLastSyncText) {
        content["lastSyncText"] = description.lastSyncText;
    }
    return content;
}

Json deviceListContent(const DeviceDescription& description) {
    const DeviceList& list = description.deviceList;
    const auto* const named = std::ranges::find(outcomes, list.outcome, &NamedOutcome::outcome);
    return Json{{"incompatible", list.incompatible},
                {"needUpgrade", list.needUpgrade},
                {"outcome", named->name},
                {"delay", list.delay}};
}

} // namespace

const DescriptionFile deviceFile{kDeviceFile, readDevice, deviceContent};
const DescriptionFile restrictionsFile{kRestrictionsFile, readRestrictions, restrictionsContent};
const DescriptionFile documentsFile{kDocumentsFile, readDocuments, documentsContent};
const DescriptionFile deviceListFile{kDeviceListFile, readDeviceListFile, deviceListContent};

std::expected<DeviceDescription, Error> readDescriptionFile(const DevicePaths& paths,
                                                            const DescriptionFile& file) {
    const auto path = paths.resolve(file.path);
    if (!path) {
        return std::unexpected(path.error());
    }
    if (std::error_code failure;
        paths.isThisMachine() && !std::filesystem::exists(*path, failure) && !failure) {
        return describeMachine(paths.root());
    }
    const auto text = readPlainFile(*path);
    if (!text) {
        return std::unexpected(text.error());
    }
    return readDescription(*text, path->string(), file);
}

std::expected<DeviceDescription, Error>
readDescription(std::string_view text, const std::string& name, const DescriptionFile& file) {
    const auto reader = JsonReader::parse(text, name);
    if (!reader) {
        return std::unexpected(reader.error());
    }
    DeviceDescription description;
    if (reader->isObject()) {
        file.read(*reader, description);
    } else {
        reader->expected("an object");
    }
    if (const auto problem = reader->problem()) {
        return std::unexpected(*problem);
    }
    return description;
}

std::expected<void, Error> writeDescriptionFile(const DevicePaths& paths,
                                                const DescriptionFile& file,
                                                const DeviceDescription& description) {
    const auto path = paths.resolve(file.path);
    if (!path) {
        return std::unexpected(path.error());
    }
    return writeFileAtomically(*path, fileText(file.content(description)));
}

std::string fileText(const Json& content) {
    return content.dump(2, ' ', false, Json::error_handler_t::replace) + '\n';
}

} // namespace nimbra::device
