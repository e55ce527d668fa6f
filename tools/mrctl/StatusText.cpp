#include "tools/mrctl/StatusText.h"

#include "device/DeviceError.h"
#include "platform/accounts/Dataclass.h"

#include <algorithm>
#include <cmath>

namespace nimbra::mrctl {

namespace {

using device::DeviceDescription;
using device::oneLine;
using Json = nlohmann::ordered_json;

bool isOn(const DeviceDescription::AccountDescription& account) {
    return account.enabled.contains(kAccountDataclassTidewater.string());
}

const char* storageOf(const DeviceDescription::AccountDescription& account) {
    return account.usesStratafile ? "new" : "old";
}

std::string heading(const char* title, bool isEmpty) {
    return std::string(title) + (isEmpty ? ": none\n" : ":\n");
}

std::string accountsText(const DeviceContents& contents) {
    std::string text = heading("Accounts", !contents.accounts || contents.accounts->empty());
    if (contents.accounts) {
        for (const auto& account : *contents.accounts) {
            text += "  " + oneLine(account.identifier) + (account.primary ? " (primary)" : "") +
                    ": documents " + (isOn(account) ? "on" : "off") + ", " + storageOf(account) +
                    " storage\n";
        }
    }
    return text;
}

std::string containersText(const DeviceDescription& documents) {
    std::string text = heading("Containers", documents.containers.empty());
    for (const auto& container : documents.containers) {
        text +=
            "  " + oneLine(container.identifier) + (container.isPublic ? " (public)" : "") + '\n';
    }
    return text;
}

std::string lastSyncText(const DeviceDescription& documents) {
    const auto& date = documents.lastSyncDate;
    if (date.is_object()) {
        const auto& error = date.at("error");
        return "Last sync: unknown: " + oneLine(error.value("description", std::string())) + '\n';
    }
    std::string text =
        "Last sync: " + (date.is_string() ? oneLine(date.get<std::string>()) : "never");
    if (documents.lastSyncText.is_string()) {
        text += " (" + oneLine(documents.lastSyncText.get<std::string>()) + ')';
    }
    return text + '\n';
}

/// Not rounded up: only what is complete shows as complete.
std::string percentage(double fraction) {
    constexpr double hundred = 100;
    // 0.29 times 100 is a little less than 29.
    constexpr double tolerance = 1e-4;
    const double most = fraction < 1 ? hundred - 1 : hundred;
    const double whole = std::floor((fraction * hundred) + tolerance);
    return std::to_string(static_cast<int>(std::min(whole, most))) + " %";
}

std::string progressText(const DeviceContents& contents) {
    std::string text = heading("Under way", contents.progress.empty());
    for (const auto& [name, values] : contents.progress) {
        text += "  " + name + ": ";
        text += values.indeterminate ? "for some time" : percentage(values.fraction);
        for (const Text& words : {values.description, values.additional}) {
            text += words.string().empty() ? "" : ", " + oneLine(words.string());
        }
        text += '\n';
    }
    return text;
}

Json orNull(const Text& text) {
    return text.isPresent() ? Json(text.string()) : Json(nullptr);
}

} // namespace

std::string statusText(const DeviceContents& contents) {
    const DeviceDescription documents = contents.documents.value_or(DeviceDescription());
    return accountsText(contents) + containersText(documents) + lastSyncText(documents) +
           progressText(contents);
}

Json statusAsJson(const DeviceContents& contents) {
    const DeviceDescription documents = contents.documents.value_or(DeviceDescription());
    Json accounts = Json::array();
    if (contents.accounts) {
        for (const auto& account : *contents.accounts) {
            accounts.push_back(Json{{"identifier", account.identifier},
                                    {"primary", account.primary},
                                    {"documents", isOn(account)},
                                    {"storage", storageOf(account)}});
        }
    }
    Json containers = Json::array();
    for (const auto& container : documents.containers) {
        containers.push_back(
            Json{{"identifier", container.identifier}, {"public", container.isPublic}});
    }
    Json progress = Json::array();
    for (const auto& [name, values] : contents.progress) {
        progress.push_back(Json{{"name", name},
                                {"fraction", values.fraction},
                                {"indeterminate", values.indeterminate},
                                {"description", orNull(values.description)},
                                {"additional", orNull(values.additional)}});
    }
    return Json{{"accounts", accounts},
                {"containers", containers},
                {"lastSyncDate", documents.lastSyncDate},
                {"lastSyncText", documents.lastSyncText},
                {"progress", progress}};
}

} // namespace nimbra::mrctl
