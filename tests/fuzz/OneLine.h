#pragma once

#include <algorithm>
#include <string>
#include <unicode/unistr.h>

namespace nimbra::test {

inline bool isUtf8(const std::string& text) {
    std::string again;
    icu::UnicodeString::fromUTF8(text).toUTF8String(again);
    return again == text;
}

/// Whether `text` can stand in a line: UTF-8 without control characters.
inline bool isOneLine(const std::string& text) {
    return isUtf8(text) &&
           std::ranges::none_of(text, [](unsigned char byte) { return byte < 0x20; });
}

} // namespace nimbra::test
