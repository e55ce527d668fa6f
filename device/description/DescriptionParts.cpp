#include "device/description/DescriptionParts.h"

#include "device/description/DescriptionValues.h"
#include "device/files/ApplicationFileName.h"
#include "device/json/JsonReader.h"

#include <climits>
#include <utility>

namespace nimbra::device {

namespace {

double readLength(const JsonReader& reader, double fallback) {
    const double length = reader.number(fallback);
    if (length <= 0) {
        reader.expected("a number above 0");
    }
    return length;
}

/// Whether a domain can be the name of a file in the directory of preferences.
bool isFileName(const std::string& domain) {
    return !domain.empty() && domain.find('/') == std::string::npos &&
           domain.find("..") == std::string::npos && domain.find('\0') == std::string::npos;
}

/// Checks what is known of the last sync: a string that `checkString` takes, null or an error.
template <class CheckString>
nlohmann::json readLastSync(const JsonReader& reader, CheckString checkString) {
    if (reader.isObject()) {
        reader.allowOnly({"error"});
        static_cast<void>(readError(reader.member("error")));
    } else if (!reader.isNull()) {
        checkString(reader);
    }
    return reader.value();
}

DeviceDescription::AccountDescription readAccount(const JsonReader& reader) {
    reader.allowOnly({"identifier", "primary", "usesStratafile", "enabled", "provisioned",
                      "cellular", "tessaryAccount"});
    return {.identifier = readName(reader.member("identifier")),
            .primary = reader.member("primary").boolean(),
            .usesStratafile = reader.member("usesStratafile").boolean(),
            .enabled = readDataclasses(reader.member("enabled")),
            .provisioned = readDataclasses(reader.member("provisioned")),
            .cellular = readDataclasses(reader.member("cellular")),
            .tessaryAccount = readNameOrNull(reader.member("tessaryAccount"))};
}

DeviceDescription::Application readApplication(const JsonReader& reader) {
    reader.allowOnly({"identifier", "name", "removedSystemApp", "entitlements", "running"});
    DeviceDescription::Application application;
    application.identifier = readName(reader.member("identifier"));
    application.name = reader.member("name").string();
    // A row that nobody can read helps nobody.
    if (application.name.find_first_not_of(' ') == std::string::npos) {
        application.name = application.identifier;
    }
    application.removedSystemApp = reader.member("removedSystemApp").boolean();
    if (const JsonReader entitlements = reader.member("entitlements"); entitlements.isObject()) {
        application.entitlements = entitlements.value();
    } else if (!entitlements.isAbsent()) {
        entitlements.expected("an object");
    }
    application.running = reader.member("running").boolean();
    return application;
}

std::optional<bool> readGranted(const JsonReader& reader) {
    if (reader.isBoolean()) {
        return reader.boolean();
    }
    if (!reader.isNull()) {
        reader.expected("true, false or null");
    }
    return std::nullopt;
}

} // namespace

void readScreen(const JsonReader& reader, DeviceDescription& description) {
    if (reader.isNull() && !reader.isAbsent()) {
        description.screen = std::nullopt;
        return;
    }
    reader.allowOnly({"width", "height", "scale"});
    const DeviceDescription::Screen usual;
    description.screen = {.width = readLength(reader.member("width"), usual.width),
                          .height = readLength(reader.member("height"), usual.height),
                          .scale = readLength(reader.member("scale"), usual.scale)};
}

void readPreferences(const JsonReader& reader, DeviceDescription& description) {
    description.preferences.clear();
    for (const std::string& domain : reader.keys()) {
        const JsonReader values = reader.member(domain);
        if (!isFileName(domain)) {
            values.note("a domain cannot be empty or contain \"/\" or \"..\"");
        } else if (!values.isObject()) {
            values.expected("an object of keys and values");
        } else {
            description.preferences.emplace(domain, values.value());
        }
    }
}

void readRestrictions(const JsonReader& reader, DeviceDescription& description) {
    reader.allowOnly({"cloudSyncDenied", "appCellularDataModificationAllowed"});
    description.cloudSyncDenied = readNames(reader.member("cloudSyncDenied"));
    description.appCellularDataModificationAllowed =
        reader.member("appCellularDataModificationAllowed").boolean(true);
}

void readAccounts(const JsonReader& reader, DeviceDescription& description) {
    description.accounts.clear();
    std::set<std::string> identifiers;
    for (const JsonReader& element : reader.elements()) {
        auto account = readAccount(element);
        if (!identifiers.insert(account.identifier).second) {
            element.member("identifier").expected("an identifier that no other account has");
        }
        description.accounts.push_back(std::move(account));
    }
}

void readApplications(const JsonReader& reader, DeviceDescription& description) {
    description.apps.clear();
    std::set<std::string> identifiers;
    for (const JsonReader& element : reader.elements()) {
        auto application = readApplication(element);
        if (!identifiers.insert(application.identifier).second) {
            element.member("identifier").expected("an identifier that no other application has");
        } else if (applicationFileName(application.identifier, ".desktop").size() > NAME_MAX) {
            element.member("identifier").expected("an identifier short enough to name a file");
        }
        description.apps.push_back(std::move(application));
    }
}

void readConsent(const JsonReader& reader, DeviceDescription& description) {
    description.consent.clear();
    for (const JsonReader& record : reader.elements()) {
        record.allowOnly({"service", "bundle", "granted"});
        description.consent.push_back({.service = readName(record.member("service")),
                                       .bundle = readNameOrNull(record.member("bundle")),
                                       .granted = readGranted(record.member("granted"))});
    }
}

void readDocuments(const JsonReader& reader, DeviceDescription& description) {
    reader.allowOnly({"identity", "containers", "lastSyncDate", "lastSyncText"});
    description.identity = readNameOrNull(reader.member("identity"));
    description.containers.clear();
    for (const JsonReader& container : reader.member("containers").elements()) {
        container.allowOnly({"identifier", "public", "registrationFails"});
        description.containers.push_back(
            {.identifier = readName(container.member("identifier")),
             .isPublic = container.member("public").boolean(),
             .registrationFails = container.member("registrationFails").boolean()});
    }
    description.lastSyncDate =
        readLastSync(reader.member("lastSyncDate"),
                     [](const JsonReader& date) { static_cast<void>(readInstant(date, {})); });
    const JsonReader sentence = reader.member("lastSyncText");
    description.lastSyncText =
        readLastSync(sentence, [](const JsonReader& text) { static_cast<void>(text.string()); });
    description.composesLastSyncText = sentence.isAbsent();
}

void readDeviceList(const JsonReader& reader, DeviceDescription& description) {
    using Outcome = DeviceDescription::DeviceList::Outcome;
    description.deviceList = {};
    if (reader.isNull()) {
        description.deviceList.outcome = Outcome::fails;
    } else if (reader.isString() && reader.string() == "never") {
        description.deviceList.outcome = Outcome::neverAnswers;
    } else if (!reader.isObject()) {
        reader.expected("an object, null or \"never\"");
    } else {
        reader.allowOnly({"incompatible", "needUpgrade"});
        readDeviceNames(reader, description);
    }
}

void readDatabaseSettings(const JsonReader& reader, DeviceDescription& description) {
    description.databaseSettings.reset();
    if (reader.isNull()) {
        return;
    }
    if (!reader.isObject()) {
        reader.expected("an object or null");
        return;
    }
    reader.allowOnly({"numAppGroups"});
    description.databaseSettings = {.numAppGroups = reader.member("numAppGroups").integer()};
}

void readStrings(const JsonReader& reader, DeviceDescription& description) {
    description.strings.emplace();
    for (const std::string& key : reader.keys()) {
        description.strings->emplace(key, reader.member(key).string());
    }
}

void readDeviceNames(const JsonReader& reader, DeviceDescription& description) {
    description.deviceList.incompatible = readTexts(reader.member("incompatible"));
    description.deviceList.needUpgrade = readTexts(reader.member("needUpgrade"));
}

void readDeviceFacts(const JsonReader& reader, DeviceDescription& description) {
    description.name = readName(reader.member("name"), description.name);
    if (const JsonReader idiom = reader.member("idiom"); !idiom.isAbsent()) {
        description.idiom = readOneOf(idiom, {"phone", "pad"});
    }
    if (const JsonReader screen = reader.member("screen"); !screen.isAbsent()) {
        readScreen(screen, description);
    }
    description.locale = readLocale(reader.member("locale"), description.locale);
    description.timeZone = readTimeZone(reader.member("timeZone"), description.timeZone);
}

void readAbilities(const JsonReader& reader, DeviceDescription& description) {
    description.cellularData = reader.member("cellularData").boolean(description.cellularData);
    description.wirelessVariant = readNameOrNull(reader.member("wirelessVariant"));
}

} // namespace nimbra::device
