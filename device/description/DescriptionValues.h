#pragma once

#include "device/json/JsonReader.h"
#include "platform/values/Date.h"
#include "platform/values/Error.h"

#include <cstdint>
#include <initializer_list>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::device {

// Reading single values of a device's description. What is not as it should be is noted at the
// reader; where nothing stands, a `fallback` is given, and without one that is noted as well. An
// array that is not there is an empty one.

/// A string that is not empty.
[[nodiscard]] std::string readName(const JsonReader& reader);
[[nodiscard]] std::string readName(const JsonReader& reader, const std::string& fallback);
/// A string that is not empty; nothing for null or nothing.
[[nodiscard]] std::optional<std::string> readNameOrNull(const JsonReader& reader);
/// One of `names`.
[[nodiscard]] std::string readOneOf(const JsonReader& reader,
                                    std::initializer_list<std::string_view> names);
/// A BCP 47 tag.
[[nodiscard]] std::string readLocale(const JsonReader& reader, const std::string& fallback);
/// The IANA name of a time zone.
[[nodiscard]] std::string readTimeZone(const JsonReader& reader, const std::string& fallback);
/// An array of names of data classes.
[[nodiscard]] std::set<std::string> readDataclasses(const JsonReader& reader);
/// An array of strings that are not empty.
[[nodiscard]] std::set<std::string> readNames(const JsonReader& reader);
/// An array of any strings, in order.
[[nodiscard]] std::vector<std::string> readTexts(const JsonReader& reader);
/// An integer of these bounds, both included; `least` where nothing stands.
[[nodiscard]] std::int64_t readIntegerBetween(const JsonReader& reader, std::int64_t least,
                                              std::int64_t most);
/// An instant as RFC 3339 writes it.
[[nodiscard]] Date readInstant(const JsonReader& reader, Date fallback);

/// An error: an object with domain, code and description.
[[nodiscard]] Error readError(const JsonReader& reader);

} // namespace nimbra::device
