#include "tests/fuzz/EntryChecks.h"

#include "device/apps/DesktopEntry.h"
#include "device/apps/DesktopLocales.h"
#include "device/apps/EntitlementsReader.h"
#include "device/system/LanguageChain.h"
#include "tests/fuzz/OneLine.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace nimbra::test {

namespace {

std::string faultIn(const EntitlementValue& value, std::size_t depth);

std::string faultInElements(const EntitlementArray& elements, std::size_t depth) {
    for (const EntitlementValue& element : elements) {
        if (auto fault = faultIn(element, depth + 1); !fault.empty()) {
            return fault;
        }
    }
    return "";
}

std::string faultInMembers(const EntitlementDictionary& members, std::size_t depth) {
    for (const EntitlementEntry& member : members) {
        if (!isUtf8(member.key)) {
            return "a key is not UTF-8";
        }
        if (auto fault = faultIn(member.value, depth + 1); !fault.empty()) {
            return fault;
        }
    }
    return "";
}

std::string faultIn(const EntitlementValue& value, std::size_t depth) {
    constexpr std::size_t deepest = 100;
    if (depth > deepest) {
        return "a value is nested too deep";
    }
    if (const auto* number = std::get_if<double>(&value.value); number && !std::isfinite(*number)) {
        return "a number is not finite";
    }
    if (const auto* text = std::get_if<std::string>(&value.value); text && !isUtf8(*text)) {
        return "a string is not UTF-8";
    }
    if (const auto* elements = std::get_if<EntitlementArray>(&value.value)) {
        return faultInElements(*elements, depth);
    }
    const auto* members = std::get_if<EntitlementDictionary>(&value.value);
    return members == nullptr ? "" : faultInMembers(*members, depth);
}

std::string faultInValues(const Entitlements& entitlements) {
    for (const auto& [key, value] : entitlements) {
        if (!isUtf8(key)) {
            return "a key is not UTF-8";
        }
        if (auto fault = faultIn(value, 1); !fault.empty()) {
            return fault;
        }
    }
    return "";
}

std::string faultInProblems(const device::DesktopEntry& entry, std::size_t lines) {
    constexpr std::size_t most = 12;
    if (entry.problems.size() > most) {
        return "there are too many problems";
    }
    if (!std::ranges::is_sorted(entry.problems, {}, &device::DesktopEntry::Problem::line)) {
        return "the problems are not in the order of their lines";
    }
    for (const auto& [line, what] : entry.problems) {
        if (line < 1 || line > lines) {
            return "a problem stands outside the text";
        }
        if (what.empty() || !isOneLine(what)) {
            return "a problem is not told in one line";
        }
    }
    return "";
}

std::string faultInEntry(const device::DesktopEntry& entry, std::size_t lines) {
    if (entry.name && (entry.name->empty() || !isUtf8(*entry.name))) {
        return "the name is empty or not UTF-8";
    }
    if (entry.icon && !isUtf8(*entry.icon)) {
        return "the icon is not UTF-8";
    }
    if (entry.isApplication && !entry.isHidden && !entry.name && entry.problems.empty()) {
        return "nobody is told of the missing name";
    }
    if (auto fault = faultInProblems(entry, lines); !fault.empty()) {
        return fault;
    }
    return faultInValues(entry.entitlements);
}

const std::vector<std::vector<std::string>>& localeNamesOfUsers() {
    static const auto users = [] {
        std::vector<std::vector<std::string>> names;
        for (const char* const locale : {"en-US", "de-AT", "sr-Latn", "zh-Hant-HK"}) {
            names.push_back(device::desktopLocaleNames(device::languageChain(locale)));
        }
        return names;
    }();
    return users;
}

} // namespace

std::string faultInEntry(std::string_view text) {
    const auto lines = static_cast<std::size_t>(1 + std::ranges::count(text, '\n'));
    for (const std::vector<std::string>& names : localeNamesOfUsers()) {
        if (auto fault = faultInEntry(device::DesktopEntry::read(text, names), lines);
            !fault.empty()) {
            return fault;
        }
    }
    return "";
}

std::string faultInEntitlements(std::string_view json) {
    const auto entitlements = device::readEntitlements(json);
    if (!entitlements) {
        return isOneLine(entitlements.error().description) ? "" : "an error is not one line";
    }
    return faultInValues(*entitlements);
}

} // namespace nimbra::test
