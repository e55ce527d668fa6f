#include "device/description/DescriptionValues.h"

#include "device/description/Instant.h"
#include "device/system/LanguageChain.h"

#include <algorithm>
#include <unicode/timezone.h>
#include <unicode/unistr.h>

namespace nimbra::device {

namespace {

bool isTimeZone(const std::string& name) {
    UErrorCode status = U_ZERO_ERROR;
    UBool isKnown = 0;
    icu::UnicodeString canonical;
    icu::TimeZone::getCanonicalID(icu::UnicodeString::fromUTF8(name), canonical, isKnown, status);
    return U_SUCCESS(status) != 0 && isKnown != 0;
}

} // namespace

std::string readName(const JsonReader& reader) {
    if (!reader.isString() || reader.string().empty()) {
        reader.expected("a string that is not empty");
        return {};
    }
    return reader.string();
}

std::string readName(const JsonReader& reader, const std::string& fallback) {
    return reader.isAbsent() ? fallback : readName(reader);
}

std::optional<std::string> readNameOrNull(const JsonReader& reader) {
    if (reader.isNull()) {
        return std::nullopt;
    }
    if (!reader.isString() || reader.string().empty()) {
        reader.expected("a string that is not empty, or null");
    }
    return reader.stringOrNull();
}

std::string readOneOf(const JsonReader& reader, std::initializer_list<std::string_view> names) {
    if (reader.isString() && std::ranges::find(names, reader.string()) != names.end()) {
        return reader.string();
    }
    std::string list;
    for (const std::string_view name : names) {
        list.append(list.empty() ? "" : ", ").append("\"").append(name).append("\"");
    }
    reader.expected("one of " + list);
    return {};
}

std::string readLocale(const JsonReader& reader, const std::string& fallback) {
    if (reader.isAbsent()) {
        return fallback;
    }
    if (!reader.isString() || !isLanguageTag(reader.string())) {
        reader.expected("a BCP 47 language tag such as \"de-DE\"");
        return fallback;
    }
    return reader.string();
}

std::string readTimeZone(const JsonReader& reader, const std::string& fallback) {
    if (reader.isAbsent()) {
        return fallback;
    }
    if (!reader.isString() || !isTimeZone(reader.string())) {
        reader.expected("the IANA name of a time zone such as \"Europe/Berlin\"");
        return fallback;
    }
    return reader.string();
}

std::set<std::string> readDataclasses(const JsonReader& reader) {
    std::set<std::string> names;
    for (const JsonReader& element : reader.elements()) {
        names.insert(readOneOf(
            element, {"kAccountDataclassTidewater", "kAccountDataclassLarder",
                      "kAccountDataclassTSYDatabaseService", "kAccountDataclassTSYDeviceService",
                      "kAccountDataclassTSYShareService", "kAccountDataclassKeyValue"}));
    }
    return names;
}

std::set<std::string> readNames(const JsonReader& reader) {
    std::set<std::string> names;
    for (const JsonReader& element : reader.elements()) {
        names.insert(readName(element));
    }
    return names;
}

std::vector<std::string> readTexts(const JsonReader& reader) {
    std::vector<std::string> texts;
    for (const JsonReader& element : reader.elements()) {
        texts.push_back(element.string());
    }
    return texts;
}

std::int64_t readIntegerBetween(const JsonReader& reader, std::int64_t least, std::int64_t most) {
    const std::int64_t value = reader.integer(least);
    if (value < least || value > most) {
        reader.expected("an integer from " + std::to_string(least) + " to " + std::to_string(most));
    }
    return value;
}

Date readInstant(const JsonReader& reader, Date fallback) {
    if (reader.isAbsent()) {
        return fallback;
    }
    const auto instant = reader.isString() ? parseInstant(reader.string()) : std::nullopt;
    if (!instant) {
        reader.expected("an RFC 3339 instant such as \"2024-03-05T14:07:09Z\"");
    }
    return instant.value_or(fallback);
}

Error readError(const JsonReader& reader) {
    if (!reader.isObject()) {
        reader.expected("an error: an object with domain, code and description");
        return {};
    }
    reader.allowOnly({"domain", "code", "description"});
    const JsonReader code = reader.member("code");
    if (code.isAbsent()) {
        code.expected("an integer");
    }
    const JsonReader description = reader.member("description");
    if (!description.isString()) {
        description.expected("a string");
        return {};
    }
    return {.domain = readName(reader.member("domain")),
            .code = static_cast<int>(code.integer()),
            .description = description.string()};
}

} // namespace nimbra::device
