#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace nimbra::mrctl {

// Characters of ASCII, whatever the locale; bytes of other characters are none of them.

[[nodiscard]] constexpr bool isDigit(char character) {
    return character >= '0' && character <= '9';
}
[[nodiscard]] constexpr bool isLower(char character) {
    return character >= 'a' && character <= 'z';
}
[[nodiscard]] constexpr bool isUpper(char character) {
    return character >= 'A' && character <= 'Z';
}
[[nodiscard]] constexpr bool isAlphanumeric(char character) {
    return isDigit(character) || isLower(character) || isUpper(character);
}
[[nodiscard]] constexpr bool isBeyondAscii(char character) {
    return static_cast<unsigned char>(character) >= 0x80U;
}
[[nodiscard]] constexpr bool isBlank(char character) {
    return character == ' ' || (character >= '\t' && character <= '\r');
}
[[nodiscard]] constexpr bool isQuote(char character) {
    return character == '"' || character == '\'' || character == '`';
}

[[nodiscard]] constexpr bool isLetter(char character) {
    return isLower(character) || isUpper(character);
}
[[nodiscard]] constexpr bool isHexadecimal(char character) {
    return isDigit(character) || (character >= 'a' && character <= 'f') ||
           (character >= 'A' && character <= 'F');
}

/// The end of the part of `text` from `begin` on that consists of `isPart`.
template <class IsPart>
[[nodiscard]] std::size_t endOfRun(std::string_view text, std::size_t begin, IsPart isPart) {
    while (begin < text.size() && isPart(text[begin])) {
        ++begin;
    }
    return begin;
}

[[nodiscard]] inline std::string lowerCase(std::string_view text) {
    std::string lower(text);
    for (char& character : lower) {
        character = isUpper(character) ? static_cast<char>(character - 'A' + 'a') : character;
    }
    return lower;
}

} // namespace nimbra::mrctl
