#include "device/system/LanguageChain.h"

#include <algorithm>
#include <array>
#include <cstdint>
#include <unicode/locid.h>
#include <unicode/uloc.h>
#include <utility>

namespace nimbra::device {

std::vector<std::string> languageChain(const std::string& locale) {
    UErrorCode status = U_ZERO_ERROR;
    icu::Locale full = icu::Locale::forLanguageTag(locale, status);
    full.addLikelySubtags(status);
    const std::string language = full.getLanguage();
    const std::string script = full.getScript();
    const std::string region = full.getCountry();
    const auto usualScript = [&](const char* country) {
        icu::Locale usual(language.c_str(), country);
        usual.addLikelySubtags(status);
        return std::string(usual.getScript());
    };

    std::vector<std::string> chain{locale};
    const auto add = [&chain](const std::string& tag) {
        if (std::ranges::find(chain, tag) == chain.end()) {
            chain.push_back(tag);
        }
    };
    if (U_FAILURE(status) != 0 || language.empty()) {
        return chain;
    }
    add(language + '-' + script + '-' + region);
    if (script == usualScript(region.c_str())) {
        add(language + '-' + region);
    }
    add(language + '-' + script);
    if (script == usualScript("")) {
        add(language);
    }
    return chain;
}

bool isLanguageTag(const std::string& tag) {
    std::array<char, ULOC_FULLNAME_CAPACITY> locale{};
    std::int32_t parsed = 0;
    UErrorCode status = U_ZERO_ERROR;
    const auto length =
        uloc_forLanguageTag(tag.c_str(), locale.data(), ULOC_FULLNAME_CAPACITY, &parsed, &status);
    return U_SUCCESS(status) != 0 && length > 0 && std::cmp_equal(parsed, tag.size());
}

} // namespace nimbra::device
