#include "tools/mrctl/JsonPseudonyms.h"

#include "tools/mrctl/Pseudonyms.h"
#include "tools/mrctl/SecretPatterns.h"

#include <nlohmann/json.hpp>
#include <optional>
#include <string>

namespace nimbra::mrctl {

namespace {

using Json = nlohmann::ordered_json;

/// The text of a string or a number; nothing for what tells nothing.
std::optional<std::string> textOf(const Json& value) {
    if (value.is_string()) {
        return value.get<std::string>();
    }
    return value.is_number() ? std::optional(value.dump()) : std::nullopt;
}

// Values are nested no deeper than the reader of files allows.
// NOLINTBEGIN(misc-no-recursion)

Json replaced(const Json& value, std::optional<SecretKind> kind, Pseudonyms& pseudonyms) {
    if (value.is_array()) {
        Json result = Json::array();
        for (const Json& element : value) {
            result.push_back(replaced(element, kind, pseudonyms));
        }
        return result;
    }
    if (value.is_object()) {
        Json result = Json::object();
        for (const auto& [key, member] : value.items()) {
            std::string name = pseudonyms.replaced(key);
            // Two keys that differ in a replaced part only differ in its pseudonym.
            while (result.contains(name)) {
                name += '\'';
            }
            result[name] = replaced(member, kind ? kind : kindOfValueNamed(key), pseudonyms);
        }
        return result;
    }
    const auto text = textOf(value);
    if (text && kind) {
        return pseudonyms.of(*kind, *text);
    }
    return value.is_string() ? Json(pseudonyms.replaced(*text)) : value;
}

// NOLINTEND(misc-no-recursion)

} // namespace

Json replacedInJson(const Json& value, Pseudonyms& pseudonyms) {
    return replaced(value, std::nullopt, pseudonyms);
}

} // namespace nimbra::mrctl
