#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// A text as somebody would read it who knows how it was encoded: "%40", "%2540", "\u0040",
/// "\x40", "&#64;" and a fullwidth sign have become "@", escaped quotation marks and slashes are
/// plain ones, and what colours a terminal or has no width is gone.
struct DecodedText {
    explicit DecodedText(std::string_view encoded);

    std::string text;
    /// Where what became each byte of `text` begins and ends in the encoded one.
    std::vector<std::size_t> begins;
    std::vector<std::size_t> ends;
};

/// The character that begins at `index` of `text`, which moves behind it; a byte that begins none
/// stands for itself, above all characters.
[[nodiscard]] char32_t nextCharacter(std::string_view text, std::size_t& index);

/// Adds `character` in UTF-8.
void appendCharacter(char32_t character, std::string& text);

} // namespace nimbra::mrctl
