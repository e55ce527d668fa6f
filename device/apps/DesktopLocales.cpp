#include "device/apps/DesktopLocales.h"

#include <algorithm>
#include <map>
#include <string_view>
#include <unicode/locid.h>

namespace nimbra::device {

namespace {

/// The scripts that have a name of their own in desktop entries.
const std::string* modifierOf(const std::string& script) {
    static const std::map<std::string, std::string, std::less<>> modifiers{
        {"Arab", "arabic"}, {"Cyrl", "cyrillic"}, {"Deva", "devanagari"}, {"Latn", "latin"}};
    const auto modifier = modifiers.find(script);
    return modifier == modifiers.end() ? nullptr : &modifier->second;
}

std::string usualScript(const icu::Locale& locale) {
    UErrorCode status = U_ZERO_ERROR;
    icu::Locale usual(locale.getLanguage(), locale.getCountry());
    usual.addLikelySubtags(status);
    return usual.getScript();
}

std::string usualRegion(icu::Locale locale) {
    UErrorCode status = U_ZERO_ERROR;
    locale.addLikelySubtags(status);
    return locale.getCountry();
}

std::string nameOf(const std::string& language, const std::string& region) {
    return region.empty() ? language : language + '_' + region;
}

std::vector<std::string> namesOf(const std::string& tag) {
    UErrorCode status = U_ZERO_ERROR;
    const icu::Locale locale = icu::Locale::forLanguageTag(tag, status);
    const std::string language = locale.getLanguage();
    if (U_FAILURE(status) != 0 || language.empty()) {
        return {};
    }
    const std::string script = locale.getScript();
    const std::string region = locale.getCountry();
    const bool isUsual = script.empty() || script == usualScript(locale);
    if (const std::string* modifier = modifierOf(script); modifier != nullptr && !isUsual) {
        return {nameOf(language, region) + '@' + *modifier};
    }
    std::vector<std::string> names;
    if (!script.empty() && modifierOf(script) == nullptr && region.empty()) {
        names.push_back(nameOf(language, usualRegion(locale)));
    }
    if (isUsual) {
        names.push_back(nameOf(language, region));
    }
    return names;
}

} // namespace

std::vector<std::string> desktopLocaleNames(const std::vector<std::string>& chain) {
    std::vector<std::string> names;
    for (const std::string& tag : chain) {
        for (std::string& name : namesOf(tag)) {
            if (std::ranges::find(names, name) == names.end()) {
                names.push_back(std::move(name));
            }
        }
    }
    return names;
}

} // namespace nimbra::device
