#include "device/DeviceDescription.h"

#include "device/description/DescriptionParts.h"
#include "device/description/DescriptionValues.h"
#include "device/description/LaterParts.h"
#include "device/json/JsonReader.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace nimbra::device {

namespace {

/// A part that is only checked, under its key.
struct LaterPart {
    const char* key;
    void (*check)(const JsonReader& reader);
};

constexpr std::array laterParts{
    LaterPart{"tool", checkTool},
};

struct Part {
    const char* key;
    void (*read)(const JsonReader& reader, DeviceDescription& description);
};

constexpr std::array parts{
    Part{"preferences", readPreferences}, Part{"restrictions", readRestrictions},
    Part{"accounts", readAccounts},       Part{"apps", readApplications},
    Part{"consent", readConsent},         Part{"documents", readDocuments},
    Part{"deviceList", readDeviceList},   Part{"databaseSettings", readDatabaseSettings},
    Part{"strings", readStrings},         Part{"faults", readFaults},
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

    // Of the faults each kind is a key of its own: some have an effect and others none yet.
    for (const std::string& kind : reader.member("faults").keys()) {
        given.keys.insert("faults/" + kind);
    }

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
    for (const LaterPart& part : laterParts) {
        if (const JsonReader value = reader.member(part.key); !value.isAbsent()) {
            part.check(value);
        }
    }
    return given;
}

GivenDescription readScenarioDevice(const JsonReader& reader) {
    GivenDescription given = readDeviceDescription(reader);
    given.description.composesLastSyncText = false;
    return given;
}

std::vector<std::string> keysWithoutEffect(const GivenDescription& given) {
    std::vector<std::string> keys;
    for (const LaterPart& part : laterParts) {
        if (given.keys.contains(part.key)) {
            keys.emplace_back(part.key);
        }
    }
    std::ranges::copy_if(given.keys, std::back_inserter(keys), [](const std::string& key) {
        return key.starts_with("faults/") && key != "faults/save" && key != "faults/consentSet";
    });
    return keys;
}

} // namespace nimbra::device
