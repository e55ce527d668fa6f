#pragma once

#include "platform/values/Date.h"
#include "platform/values/Error.h"

#include <chrono>
#include <cstdint>
#include <map>
#include <nlohmann/json.hpp>
#include <optional>
#include <set>
#include <string>
#include <vector>

namespace nimbra::device {

class JsonReader;

/// What a device is made from: the `device` object of a scenario, or the file given to
/// `settingsctl init --from`. Every member has the default of a device that nobody described.
struct DeviceDescription {
    struct Screen {
        /// In points.
        double width = 390;
        double height = 844;
        /// How many pixels a point has in each direction.
        double scale = 2;
    };
    /// An account of a given list; what is left out of it is false, empty or null.
    struct AccountDescription {
        std::string identifier;
        bool primary = false;
        bool usesStratafile = false;
        std::set<std::string> enabled;
        std::set<std::string> provisioned;
        std::set<std::string> cellular;
        std::optional<std::string> tessaryAccount;
    };
    /// An installed application; one whose name is left out goes by its identifier.
    struct Application {
        std::string identifier;
        std::string name;
        bool removedSystemApp = false;
        nlohmann::json entitlements = nlohmann::json::object();
        bool running = false;
    };
    /// What the user said of one application's use of one service.
    struct ConsentRecord {
        std::string service;
        /// Absent for an application without an identifier.
        std::optional<std::string> bundle;
        /// Absent where the user has said nothing yet.
        std::optional<bool> granted;
    };
    struct Container {
        std::string identifier;
        bool isPublic = false;
        bool registrationFails = false;
    };
    /// What an account's service says of the account's devices when it is asked.
    struct DeviceList {
        enum class Outcome : std::uint8_t { answers, fails, neverAnswers };

        /// As their users call them, in the order of the answer.
        std::vector<std::string> incompatible;
        std::vector<std::string> needUpgrade;
        Outcome outcome = Outcome::answers;
        /// How long the service takes, in seconds.
        double delay = 0;
    };

    /// The settings of the cloud database, which have a bundle of their own.
    struct DatabaseSettings {
        std::int64_t numAppGroups = 0;
    };

    /// What stands in the place of the document service's command-line tool.
    struct Tool {
        enum class Kind : std::uint8_t { real, missing, standIn };

        Kind kind = Kind::real;
        // What a stand-in does, one after the other:
        /// Whether it writes an archive to where its last argument says.
        bool writesArchive = false;
        /// The signal that it ends by; nothing for one that exits.
        std::optional<int> signal;
        int exitStatus = 0;
    };

    std::string name = "Nimbra Phone";
    /// "phone" or "pad".
    std::string idiom = "phone";
    std::optional<Screen> screen = Screen();
    /// A BCP 47 tag.
    std::string locale = "en-US";
    /// An IANA name.
    std::string timeZone = "UTC";
    /// When a scenario begins; a device that is used goes by the machine's clock.
    Date now;
    bool cellularData = true;
    /// The device's own wording of wireless networks; nothing for the usual one.
    std::optional<std::string> wirelessVariant;
    /// By domain: an object of keys and values each.
    std::map<std::string, nlohmann::json> preferences;
    /// The applications that may not use the cloud.
    std::set<std::string> cloudSyncDenied;
    bool appCellularDataModificationAllowed = true;
    std::vector<AccountDescription> accounts;
    std::vector<Application> apps;
    /// In the order in which they came to be.
    std::vector<ConsentRecord> consent;
    /// Who is signed in to cloud documents; nothing for nobody.
    std::optional<std::string> identity;
    std::vector<Container> containers;
    /// The last sync as it was given: an instant or a sentence, null, or an object with an error.
    nlohmann::json lastSyncDate;
    nlohmann::json lastSyncText;
    /// Whether nobody has given the sentence: the device composes it from the date.
    bool composesLastSyncText = false;
    DeviceList deviceList;
    /// Nothing for a device without the bundle.
    std::optional<DatabaseSettings> databaseSettings;
    Tool tool;
    /// The table "Localizable" instead of the bundle's own.
    std::optional<std::map<std::string, std::string>> strings;
    bool paneBundleRegistered = true;
    /// The outcomes of the next saves of an account, in order: an error for one that fails.
    std::vector<std::optional<Error>> saveFaults;
    /// The outcomes of the next changes of consent, in order: false for one that is refused.
    std::vector<std::optional<bool>> consentSetFaults;
    /// The outcomes of the next removals of files and of the next folders made: an error for one
    /// that fails.
    std::vector<std::optional<Error>> removeItemFaults;
    std::vector<std::optional<Error>> createDirectoryFaults;
    /// The outcomes of the next starts of programs: an errno for one that fails.
    std::vector<std::optional<int>> spawnFaults;

    DeviceDescription();

    /// The identifiers of the applications that run.
    [[nodiscard]] std::set<std::string> runningApplications() const;
};

/// A description with the keys that were given in it; the other members have their defaults.
struct GivenDescription {
    DeviceDescription description;
    std::set<std::string> keys;
};

/// Reads the object at `reader`. What is not as it should be, unknown keys included, is noted
/// there; keys that this version checks but does not use yet are among `keys` all the same.
[[nodiscard]] GivenDescription readDeviceDescription(const JsonReader& reader);

/// The same for the device of a scenario, which composes no sentence: without one there is none.
[[nodiscard]] GivenDescription readScenarioDevice(const JsonReader& reader);

} // namespace nimbra::device
