#include "tests/house/TablePattern.h"

#include <memory>
#include <unicode/locid.h>
#include <unicode/messagepattern.h>
#include <unicode/plurrule.h>
#include <unicode/unistr.h>

namespace nimbra::test {

namespace {

std::string utf8(const icu::UnicodeString& text) {
    std::string result;
    text.toUTF8String(result);
    return result;
}

std::string typeName(UMessagePatternArgType type) {
    switch (type) {
    case UMSGPAT_ARG_TYPE_NONE:
        return "none";
    case UMSGPAT_ARG_TYPE_SIMPLE:
        return "simple";
    case UMSGPAT_ARG_TYPE_PLURAL:
        return "plural";
    default:
        return "other";
    }
}

/// The categories of the plural argument that starts at `start`.
std::set<std::string> categories(const icu::MessagePattern& pattern, int start) {
    std::set<std::string> result;
    for (int i = start + 1; i < pattern.getLimitPartIndex(start); ++i) {
        const auto& part = pattern.getPart(i);
        if (part.getType() == UMSGPAT_PART_TYPE_ARG_SELECTOR) {
            result.insert(utf8(pattern.getSubstring(part)));
        } else if (part.getType() == UMSGPAT_PART_TYPE_MSG_START) {
            i = pattern.getLimitPartIndex(i);
        }
    }
    return result;
}

} // namespace

TablePattern readTablePattern(const std::string& text) {
    UErrorCode status = U_ZERO_ERROR;
    UParseError place{};
    const icu::MessagePattern pattern(icu::UnicodeString::fromUTF8(text), &place, status);
    TablePattern result;
    if (U_FAILURE(status)) {
        result.error = u_errorName(status);
        return result;
    }
    for (int i = 0; i < pattern.countParts(); ++i) {
        const auto& part = pattern.getPart(i);
        if (part.getType() != UMSGPAT_PART_TYPE_ARG_START) {
            continue;
        }
        const auto& number = pattern.getPart(i + 1);
        if (number.getType() != UMSGPAT_PART_TYPE_ARG_NUMBER) {
            result.error = "an argument has a name instead of a number";
            return result;
        }
        result.placeholders.emplace(number.getValue(), typeName(part.getArgType()));
        if (part.getArgType() == UMSGPAT_ARG_TYPE_PLURAL) {
            result.pluralCategories[number.getValue()] = categories(pattern, i);
        }
    }
    return result;
}

std::set<std::string> pluralCategoriesOf(const std::string& language) {
    UErrorCode status = U_ZERO_ERROR;
    const std::unique_ptr<icu::PluralRules> rules(
        icu::PluralRules::forLocale(icu::Locale(language.c_str()), status));
    const std::unique_ptr<icu::StringEnumeration> keywords(rules->getKeywords(status));
    std::set<std::string> result;
    while (const icu::UnicodeString* keyword = keywords->snext(status)) {
        result.insert(utf8(*keyword));
    }
    return result;
}

} // namespace nimbra::test
