#pragma once

#include "platform/values/Error.h"

#include <expected>
#include <nlohmann/json_fwd.hpp>
#include <string>
#include <string_view>

namespace nimbra::device {

/// The JSON document in `text`, its members in the order of the text. Messages call it `name`.
/// Besides what JSON forbids, a key that an object has twice and values nested more than 100 deep
/// are errors.
[[nodiscard]] std::expected<nlohmann::ordered_json, Error> parseJson(std::string_view text,
                                                                     const std::string& name);

/// `token` as it stands in a JSON pointer.
[[nodiscard]] std::string escapedForJsonPointer(const std::string& token);

} // namespace nimbra::device
