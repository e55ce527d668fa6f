#include "tools/mrctl/JsonPseudonyms.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/Pseudonyms.h"
#include "tools/mrctl/SecretNames.h"

#include <algorithm>
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

bool isOfSentence(char character) {
    return isBlank(character) || isBeyondAscii(character);
}

/// What stands for a value that is neither an array nor an object.
Json replacedScalar(const Json& value, std::optional<SecretKind> kind, bool hidesSentences,
                    Pseudonyms& pseudonyms) {
    const auto text = textOf(value);
    if (!text) {
        return value;
    }
    if (kind) {
        return pseudonyms.of(*kind, *text);
    }
    const bool isSentence = hidesSentences && std::ranges::any_of(*text, isOfSentence);
    // A number may be one that an account is called by.
    if (isSentence || pseudonyms.isKnown(*text)) {
        return pseudonyms.of(SecretKind::text, *text);
    }
    std::string readable = pseudonyms.replaced(*text);
    return value.is_string() || readable != *text ? Json(std::move(readable)) : value;
}

// Values are nested no deeper than the reader of files allows.
// NOLINTBEGIN(misc-no-recursion)

Json replaced(const Json& value, std::optional<SecretKind> kind, bool hidesSentences,
              Pseudonyms& pseudonyms) {
    if (value.is_array()) {
        Json result = Json::array();
        for (const Json& element : value) {
            result.push_back(replaced(element, kind, hidesSentences, pseudonyms));
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
            // The code of an error is none that lets anybody in.
            const bool isErrorCode = hidesSentences && key == "code" && member.is_number();
            const auto named = isErrorCode ? std::nullopt : kindOfValueNamed(key);
            result[name] = replaced(member, kind ? kind : named, hidesSentences, pseudonyms);
        }
        return result;
    }
    return replacedScalar(value, kind, hidesSentences, pseudonyms);
}

// NOLINTEND(misc-no-recursion)

} // namespace

Json replacedInJson(const Json& value, Pseudonyms& pseudonyms) {
    return replaced(value, std::nullopt, false, pseudonyms);
}

Json withoutSentences(const Json& value, Pseudonyms& pseudonyms) {
    return replaced(value, std::nullopt, true, pseudonyms);
}

} // namespace nimbra::mrctl
