#include "device/DeviceDescription.h"

#include "device/description/DescriptionParts.h"
#include "device/description/DescriptionValues.h"
#include "device/json/JsonReader.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace nimbra::device {

namespace {

struct Part {
    const char* key;
    void (*read)(const JsonReader& reader, DeviceDescription& description);
};

constexpr std::array parts{
    Part{"preferences", readPreferences},
    Part{"restrictions", readRestrictions},
    Part{"accounts", readAccounts},
    Part{"apps", readApplications},
    Part{"consent", readConsent},
    Part{"documents", readDocuments},
    Part{"deviceList", readDeviceList},
    Part{"databaseSettings", readDatabaseSettings},
    Part{"tool", readTool},
    Part{"strings", readStrings},
    Part{"faults", readFaults},
};

} // namespace

DeviceDescription::DeviceDescription()
    : now(std::chrono::sys_days(std::chrono::March / 5 / 2024) + std::chrono::hours(14) +
          std::chrono::minutes(7) + std::chrono::seconds(9)),
      accounts{{.identifier = "primary", .primary = true, .usesStratafile = true}} {}

std::set<std::string> DeviceDescription::runningApplications() const {
    std::set<std::string> identifiers;
    for (const Application& application : apps) {
        if (application.running) {
            identifiers.insert(application.identifier);
        }
    }
    return identifiers;
}

GivenDescription readDeviceDescription(const JsonReader& reader) {
    reader.allowOnly({"name",
                      "idiom",
                      "screen",
                      "locale",
                      "timeZone",
                      "now",
                      "cellularData",
                      "wirelessVariant",
                      "preferences",
                      "restrictions",
                      "accounts",
                      "apps",
                      "consent",
                      "documents",
                      "deviceList",
                      "databaseSettings",
                      "tool",
                      "strings",
                      "paneBundleRegistered",
                      "faults"});
    GivenDescription given;
    std::ranges::copy(reader.keys(), std::inserter(given.keys, given.keys.end()));

    DeviceDescription& description = given.description;
    readDeviceFacts(reader, description);
    description.now = readInstant(reader.member("now"), description.now);
    readAbilities(reader, description);
    for (const Part& part : parts) {
        if (const JsonReader value = reader.member(part.key); !value.isAbsent()) {
            part.read(value, description);
        }
    }
    description.paneBundleRegistered = reader.member("paneBundleRegistered").boolean(true);
    return given;
}

GivenDescription readScenarioDevice(const JsonReader& reader) {
    GivenDescription given = readDeviceDescription(reader);
    given.description.composesLastSyncText = false;
    return given;
}

} // namespace nimbra::device
