#include "tools/mrctl/Report.h"

#include "device/DeviceError.h"
#include "device/description/DescriptionFiles.h"
#include "tools/mrctl/Characters.h"
#include "tools/mrctl/JsonPseudonyms.h"
#include "tools/mrctl/Pseudonyms.h"
#include "tools/mrctl/Versions.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <set>
#include <string_view>
#include <unistd.h>
#include <utility>

namespace nimbra::mrctl {

namespace {

using Json = nlohmann::ordered_json;

/// Makes a report: learns all that is secret first, then writes the files.
class Writer {
public:
    Writer(const DeviceContents& contents, const std::filesystem::path& root)
        : _contents(contents), _pseudonyms(root.string()) {}

    [[nodiscard]] Report write(const std::string& archiveName) {
        learnFields();
        _pseudonyms.setLearning(true);
        addAll(archiveName);
        _report = Report();
        _pseudonyms.setLearning(false);
        addAll(archiveName);
        return std::move(_report);
    }

private:
    void addAll(const std::string& archiveName) {
        _report.folder = folderOf(archiveName);
        addDevice();
        addAccounts();
        addDocuments();
        addOthers();
        addApplications();
        addProgress();
        add("versions.json", "versions of the program, its databases, the kernel and libraries",
            versionsOf(_contents));
        addTexts();
        addManifest();
    }

    /// What is called by its name in fields of its own; everything else is learned where it stands.
    void learnFields() {
        for (const auto& application : _contents.applications) {
            _bundles.insert(application.identifier);
            if (isMadeByProgram(application.identifier)) {
                _pseudonyms.keep(application.identifier);
            }
        }
        if (_contents.facts) {
            learnName(SecretKind::device, _contents.facts->name);
        }
        constexpr std::size_t longestHostName = 256;
        std::array<char, longestHostName> buffer{};
        static_cast<void>(::gethostname(buffer.data(), buffer.size() - 1));
        if (const std::string host = buffer.data(); host != "localhost") {
            _pseudonyms.learn(SecretKind::device, host);
        }
        for (const auto& account : accounts()) {
            // What stands behind the sign of an address is a host, which many share.
            const std::string_view id = account.identifier;
            _pseudonyms.learn(SecretKind::account, account.identifier);
            _pseudonyms.learnWords(SecretKind::account, id.substr(0, id.find('@')));
            _pseudonyms.learnFrom(account.identifier);
            _pseudonyms.learn(SecretKind::account, account.tessaryAccount.value_or(""));
        }
        if (_contents.documents) {
            learnName(SecretKind::identity, _contents.documents->identity.value_or(""));
            for (const auto& container : _contents.documents->containers) {
                _pseudonyms.learn(SecretKind::container, container.identifier,
                                  _bundles.contains(container.identifier)
                                      ? Pseudonyms::Search::ownFields
                                      : Pseudonyms::Search::everywhere);
                _pseudonyms.learnWords(SecretKind::container,
                                       std::string_view(container.identifier)
                                           .substr(container.identifier.rfind('.') + 1));
            }
        }
        for (const auto* const names : deviceNames()) {
            for (const std::string& name : *names) {
                learnName(SecretKind::device, name);
            }
        }
        for (const auto& [name, values] : _contents.progress) {
            learnName(SecretKind::file, name);
            for (const Text& text : {values.description, values.additional}) {
                _pseudonyms.learn(SecretKind::text, text.string());
            }
        }
    }

    void learnName(SecretKind kind, const std::string& name) {
        _pseudonyms.learn(kind, name);
        _pseudonyms.learnWords(kind, name);
    }

    [[nodiscard]] std::vector<device::DeviceDescription::AccountDescription> accounts() const {
        return _contents.accounts.value_or(
            std::vector<device::DeviceDescription::AccountDescription>());
    }

    [[nodiscard]] std::vector<const std::vector<std::string>*> deviceNames() const {
        if (!_contents.deviceList) {
            return {};
        }
        const auto& list = _contents.deviceList->deviceList;
        return {&list.incompatible, &list.needUpgrade};
    }

    void add(const std::string& name, const std::string& what, const Json& content) {
        addText(name, what, device::fileText(content));
    }
    void addText(const std::string& name, const std::string& what, std::string content) {
        _report.files.push_back({.name = name, .what = what, .content = std::move(content)});
    }

    template <class Names>
    Json replacedAll(const Names& names) {
        Json result = Json::array();
        for (const std::string& name : names) {
            result.push_back(word(name));
        }
        return result;
    }

    /// A name that a program gave, which stays readable if it is made like one; what somebody wrote
    /// does not.
    std::string word(const std::string& name) {
        return isMadeByProgram(name) ? _pseudonyms.replaced(name)
                                     : _pseudonyms.of(SecretKind::text, name);
    }
    static bool isMadeByProgram(const std::string& name) {
        return std::ranges::all_of(name, [](char character) {
            return isAlphanumeric(character) || std::string_view(".-_").contains(character);
        });
    }

    template <class Names>
    Json pseudonymsOf(SecretKind kind, const Names& names) {
        Json result = Json::array();
        for (const std::string& name : names) {
            result.push_back(_pseudonyms.of(kind, name));
        }
        return result;
    }

    Json orNull(SecretKind kind, const std::optional<std::string>& value) {
        return value ? Json(_pseudonyms.of(kind, *value)) : Json(nullptr);
    }

    void addDevice() {
        if (!_contents.facts) {
            return;
        }
        device::DeviceDescription facts = *_contents.facts;
        facts.name = _pseudonyms.of(SecretKind::device, facts.name);
        if (facts.wirelessVariant) {
            facts.wirelessVariant = word(*facts.wirelessVariant);
        }
        add("device.json", "the device: screen, language, time zone, abilities",
            device::deviceFile.content(facts));
    }

    void addAccounts() {
        if (!_contents.accounts) {
            return;
        }
        Json list = Json::array();
        for (const auto& account : *_contents.accounts) {
            list.push_back(
                Json{{"account", _pseudonyms.of(SecretKind::account, account.identifier)},
                     {"primary", account.primary},
                     {"usesStratafile", account.usesStratafile},
                     {"enabled", replacedAll(account.enabled)},
                     {"provisioned", replacedAll(account.provisioned)},
                     {"cellular", replacedAll(account.cellular)},
                     {"tessaryAccount", orNull(SecretKind::account, account.tessaryAccount)}});
        }
        add("accounts.json", "the accounts, their flags and data classes", list);
    }

    void addDocuments() {
        if (!_contents.documents) {
            return;
        }
        const auto& documents = *_contents.documents;
        Json containers = Json::array();
        for (const auto& container : documents.containers) {
            containers.push_back(
                Json{{"container", _pseudonyms.of(SecretKind::container, container.identifier)},
                     {"public", container.isPublic},
                     {"registrationFails", container.registrationFails}});
        }
        const Json sentence = documents.lastSyncText;
        Json content{{"identity", orNull(SecretKind::identity, documents.identity)},
                     {"containers", containers},
                     {"lastSyncDate", withoutSentences(documents.lastSyncDate, _pseudonyms)}};
        if (!documents.composesLastSyncText) {
            content["lastSyncText"] =
                sentence.is_string()
                    ? Json(_pseudonyms.of(SecretKind::text, sentence.get<std::string>()))
                    : withoutSentences(sentence, _pseudonyms);
        }
        add("documents.json", "the identity, the document containers and the last sync", content);
    }

    void addOthers() {
        if (_contents.deviceList) {
            const auto lists = deviceNames();
            auto list = device::deviceListFile.content(*_contents.deviceList);
            list["incompatible"] = pseudonymsOf(SecretKind::device, *lists.front());
            list["needUpgrade"] = pseudonymsOf(SecretKind::device, *lists.back());
            add("device-list.json", "what the accounts' service says of their other devices", list);
        }
        if (_contents.consent) {
            Json list = Json::array();
            for (const auto& [service, bundle, granted] : *_contents.consent) {
                list.push_back(Json{{"service", word(service)},
                                    {"bundle", bundle ? Json(bundleName(*bundle)) : Json(nullptr)},
                                    {"granted", granted ? Json(*granted) : Json(nullptr)}});
            }
            add("consent.json", "what the user allows to applications", list);
        }
        for (const auto& [domain, values] : _contents.preferences) {
            add("preferences/" + domainName(domain) + ".json", "preferences of an application",
                replacedInJson(values, _pseudonyms));
        }
        if (_contents.restrictions) {
            auto restrictions = device::restrictionsFile.content(*_contents.restrictions);
            Json denied = Json::array();
            for (const std::string& bundle : _contents.restrictions->cloudSyncDenied) {
                denied.push_back(bundleName(bundle));
            }
            restrictions["cloudSyncDenied"] = denied;
            add("restrictions.json", "what is forbidden on the device", restrictions);
        }
    }

    /// An application's identifier stays readable, where it is made like one and holds no account.
    std::string bundleName(const std::string& identifier) {
        const bool holdsAccount = std::ranges::any_of(accounts(), [&](const auto& account) {
            constexpr std::size_t leastSize = 6;
            return account.identifier.size() >= leastSize &&
                   lowerCase(identifier).contains(lowerCase(account.identifier));
        });
        if (holdsAccount || !identifier.contains('.')) {
            return _pseudonyms.of(SecretKind::text, identifier);
        }
        return _bundles.contains(identifier) && isMadeByProgram(identifier) ? identifier
                                                                            : word(identifier);
    }

    /// The domain of preferences in the name of a file.
    std::string domainName(const std::string& domain) {
        return domain.contains('.') ? word(domain) : _pseudonyms.of(SecretKind::file, domain);
    }

    void addApplications() {
        Json list = Json::array();
        for (const auto& [identifier, isHidden, isRunning] : _contents.applications) {
            list.push_back(Json{{"identifier", bundleName(identifier)},
                                {"hidden", isHidden},
                                {"running", isRunning}});
        }
        add("applications.json", "the applications that are installed", list);
    }

    void addProgress() {
        Json list = Json::array();
        for (const auto& [name, values] : _contents.progress) {
            const auto text = [this](const Text& value) {
                return !value.isPresent() ? Json(nullptr)
                                          : Json(_pseudonyms.of(SecretKind::text, value.string()));
            };
            list.push_back(
                Json{{"file", _pseudonyms.of(SecretKind::file, name)},
                     {"fraction", values.fraction},
                     {"indeterminate", values.indeterminate},
                     {"fileOperationKind", !values.fileOperationKind.isPresent()
                                               ? Json(nullptr)
                                               : Json(word(values.fileOperationKind.string()))},
                     {"description", text(values.description)},
                     {"additional", text(values.additional)}});
        }
        add("progress.json", "the syncs that are under way", list);
    }

    void addTexts() {
        if (_contents.log) {
            std::string text;
            // The lines of a private key tell nothing by themselves.
            bool isInKey = false;
            for (const std::string& line : *_contents.log) {
                const bool isEnd = line.contains("-----END ");
                text += isInKey && !isEnd ? "(a line of a key is left out)"
                                          : _pseudonyms.replaced(line);
                text += '\n';
                isInKey = !isEnd && (isInKey || line.contains("-----BEGIN "));
            }
            addText("log.txt", "the newest lines of the device's log", std::move(text));
        }
        std::string problems;
        for (const auto& [part, what] : _contents.problems) {
            problems += part + ": " + _pseudonyms.replaced(device::oneLine(what)) + '\n';
        }
        addText("problems.txt", "what could not be read, a line each", std::move(problems));
    }

    void addManifest() {
        std::string text = "Files, with their sizes in bytes:\n";
        for (const auto& [name, what, content] : _report.files) {
            text.append("  ").append(name).append("  ");
            text.append(std::to_string(content.size())).append("  ").append(what).append("\n");
        }
        text += "\nReplaced by pseudonyms, the same value by the same one throughout:\n";
        for (const auto& [kind, count] : _pseudonyms.counts()) {
            text += "  " + std::string(nameOf(kind)) + "  values: " + std::to_string(count.values) +
                    "  places: " + std::to_string(count.places) + '\n';
        }
        // Whoever unpacks an archive meets it first.
        _report.files.insert(_report.files.begin(),
                             {.name = "MANIFEST", .what = "this list", .content = std::move(text)});
    }

    std::string folderOf(const std::string& archiveName) {
        constexpr std::string_view suffix = ".tar.gz";
        std::string name = archiveName;
        if (name.ends_with(suffix)) {
            name.resize(name.size() - suffix.size());
        }
        // The name of the device is a field of its own there.
        constexpr std::string_view start = "stratafile-";
        const std::string device =
            _contents.facts ? fileNamePart(_contents.facts->name) + '-' : std::string();
        std::string folder;
        if (!device.empty() && name.starts_with(std::string(start) + device)) {
            folder =
                std::string(start) + _pseudonyms.of(SecretKind::device, _contents.facts->name) +
                '-' +
                _pseudonyms.replaced(std::string_view(name).substr(start.size() + device.size()));
        } else {
            folder = _pseudonyms.replaced(name);
        }
        folder = device::oneLine(folder);
        return folder.empty() || folder == "." || folder == ".." ? "diagnosis" : folder;
    }

    const DeviceContents& _contents;
    /// The identifiers of applications, which stay as they are: a container that is called like an
    /// application tells nothing more.
    std::set<std::string> _bundles;
    Pseudonyms _pseudonyms;
    Report _report;
};

} // namespace

Report Report::of(const DeviceContents& contents, const std::filesystem::path& root,
                  const std::string& archiveName) {
    return Writer(contents, root).write(archiveName);
}

} // namespace nimbra::mrctl
