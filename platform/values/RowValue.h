#pragma once

#include "platform/values/Text.h"

#include <cstdint>
#include <variant>

namespace nimbra {

/// What a row's getter gives and its setter takes, and what a row's properties hold:
/// nothing, a boolean, an integer or a text.
using RowValue = std::variant<std::monostate, bool, std::int64_t, Text>;

/// The boolean in `value`; false where it holds anything else.
inline bool boolValue(const RowValue& value) {
    const bool* held = std::get_if<bool>(&value);
    return held != nullptr && *held;
}

/// The text in `value`; absent where it holds anything else.
inline Text textValue(const RowValue& value) {
    const Text* held = std::get_if<Text>(&value);
    return held != nullptr ? *held : Text();
}

} // namespace nimbra
