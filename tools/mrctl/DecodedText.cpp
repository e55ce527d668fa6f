#include "tools/mrctl/DecodedText.h"

#include "tools/mrctl/Characters.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <optional>
#include <utility>

namespace nimbra::mrctl {

namespace {

constexpr char32_t lastCharacter = 0x10FFFF;

/// What an encoded piece stands for, and how long the piece is.
struct Piece {
    std::string text;
    std::size_t size;
};

std::optional<char32_t> number(std::string_view digits, int base) {
    char32_t value = 0;
    std::uint32_t parsed = 0;
    const auto [end, error] =
        std::from_chars(digits.data(), digits.data() + digits.size(), parsed, base);
    value = parsed;
    return error == std::errc() && end == digits.data() + digits.size() ? std::optional(value)
                                                                        : std::nullopt;
}

std::string utf8(char32_t character) {
    std::string text;
    appendCharacter(character, text);
    return text;
}

/// "%40", however often its "%" is written as "%25".
std::optional<Piece> percentPiece(std::string_view text) {
    constexpr std::size_t digits = 2;
    std::size_t at = 1;
    while (text.substr(at, digits) == "25" && text.size() >= at + digits + digits &&
           isHexadecimal(text[at + digits]) && isHexadecimal(text[at + digits + 1])) {
        at += digits;
    }
    const auto byte = number(text.substr(at, digits), 16);
    if (!byte || text.size() < at + digits) {
        return std::nullopt;
    }
    return Piece{.text = std::string(1, static_cast<char>(*byte)), .size = at + digits};
}

/// "\u0040", "\x40", "\"" and "\/", behind any number of backslashes.
std::optional<Piece> backslashPiece(std::string_view text) {
    constexpr std::size_t mostBackslashes = 16;
    const std::size_t at = endOfRun(text.substr(0, mostBackslashes), 0,
                                    [](char character) { return character == '\\'; });
    if (at >= text.size()) {
        return std::nullopt;
    }
    if (isQuote(text[at]) || text[at] == '/') {
        return Piece{.text = std::string(1, text[at]), .size = at + 1};
    }
    const std::size_t digits = text[at] == 'u' ? 4 : 2;
    if ((text[at] != 'u' && text[at] != 'x') || text.size() < at + 1 + digits) {
        return std::nullopt;
    }
    auto character = number(text.substr(at + 1, digits), 16);
    if (!character) {
        return std::nullopt;
    }
    if (text[at] == 'x') {
        return Piece{.text = std::string(1, static_cast<char>(*character)), .size = at + 3};
    }
    std::size_t size = at + 1 + digits;
    // Characters beyond the first 65,536 are written as two of these.
    const std::string_view second = text.substr(size);
    const std::size_t behind = endOfRun(second, 0, [](char sign) { return sign == '\\'; });
    if (*character >= 0xD800 && *character < 0xDC00 && behind > 0 &&
        second.substr(behind, 1) == "u") {
        const auto low = number(second.substr(behind + 1, 4), 16);
        if (low && *low >= 0xDC00 && *low < 0xE000) {
            character = 0x10000 + ((*character - 0xD800) * 0x400) + (*low - 0xDC00);
            size += behind + 5;
        }
    }
    return Piece{.text = utf8(*character), .size = size};
}

/// "&#64;", "&#x40;" and the names of the signs that HTML itself is written in.
std::optional<Piece> entityPiece(std::string_view text) {
    constexpr std::size_t longest = 10;
    const std::size_t end = text.substr(0, longest).find(';');
    if (end == std::string_view::npos) {
        return std::nullopt;
    }
    const std::string_view name = text.substr(1, end - 1);
    if (name.starts_with('#')) {
        const bool isHex = name.size() > 1 && (name[1] == 'x' || name[1] == 'X');
        const auto character = number(name.substr(isHex ? 2 : 1), isHex ? 16 : 10);
        return character ? std::optional(Piece{.text = utf8(*character), .size = end + 1})
                         : std::nullopt;
    }
    constexpr std::array<std::pair<std::string_view, std::string_view>, 7> names{{{"amp", "&"},
                                                                                  {"lt", "<"},
                                                                                  {"gt", ">"},
                                                                                  {"quot", "\""},
                                                                                  {"apos", "'"},
                                                                                  {"nbsp", " "},
                                                                                  {"commat", "@"}}};
    const auto* const found =
        std::ranges::find(names, name, [](const auto& pair) { return pair.first; });
    return found != names.end()
               ? std::optional(Piece{.text = std::string(found->second), .size = end + 1})
               : std::nullopt;
}

/// What sets the colours of a terminal; its first character has become a blank in a line of a log.
std::optional<Piece> colourPiece(std::string_view text) {
    if (text.substr(1, 1) != "[") {
        return std::nullopt;
    }
    const std::size_t end =
        endOfRun(text, 2, [](char character) { return isDigit(character) || character == ';'; });
    return text.substr(end, 1) == "m" ? std::optional(Piece{.text = {}, .size = end + 1})
                                      : std::nullopt;
}

/// Blanks of other widths, signs without one, and the fullwidth forms of ASCII.
std::optional<Piece> widthPiece(std::string_view text) {
    std::size_t size = 0;
    const char32_t character = nextCharacter(text, size);
    if (character == 0xAD || character == 0xFEFF || (character >= 0x200B && character <= 0x200F) ||
        (character >= 0x2060 && character <= 0x2064)) {
        return Piece{.text = {}, .size = size};
    }
    if (character == 0xA0 || character == 0x3000 || character == 0x202F ||
        (character >= 0x2000 && character <= 0x200A)) {
        return Piece{.text = " ", .size = size};
    }
    if (character >= 0xFF01 && character <= 0xFF5E) {
        return Piece{.text = utf8(character - 0xFF01 + '!'), .size = size};
    }
    return std::nullopt;
}

std::optional<Piece> pieceAt(std::string_view text) {
    switch (text.front()) {
    case '%':
        return percentPiece(text);
    case '\\':
        return backslashPiece(text);
    case '&':
        return entityPiece(text);
    case ' ':
    case '\x1b':
        return colourPiece(text);
    default:
        return isBeyondAscii(text.front()) ? widthPiece(text) : std::nullopt;
    }
}

} // namespace

DecodedText::DecodedText(std::string_view encoded) {
    for (std::size_t index = 0; index < encoded.size();) {
        const Piece piece = pieceAt(encoded.substr(index))
                                .value_or(Piece{.text = std::string(1, encoded[index]), .size = 1});
        text += piece.text;
        begins.resize(text.size(), index);
        index += piece.size;
        ends.resize(text.size(), index);
    }
}

char32_t nextCharacter(std::string_view text, std::size_t& index) {
    const auto byteAt = [text](std::size_t at) {
        return at < text.size() ? static_cast<unsigned char>(text[at]) : 0U;
    };
    const char32_t first = byteAt(index);
    std::size_t more = 0;
    for (const char32_t least : {0xC0U, 0xE0U, 0xF0U}) {
        more += first >= least ? 1U : 0U;
    }
    char32_t character = more == 0 ? first : first & (0x3FU >> more);
    for (std::size_t count = 1; count <= more; ++count) {
        const char32_t next = byteAt(index + count);
        if ((next & 0xC0U) != 0x80) {
            ++index;
            return lastCharacter + first;
        }
        character = character * 0x40 + (next & 0x3FU);
    }
    index += more + 1;
    return more == 0 && first >= 0x80 ? lastCharacter + first : character;
}

void appendCharacter(char32_t character, std::string& text) {
    const auto add = [&text](char32_t byte) {
        text += static_cast<char>(static_cast<unsigned char>(byte));
    };
    if (character > lastCharacter) {
        add(character - lastCharacter);
    } else if (character >= 0x10000) {
        add(0xF0U | (character >> 18U));
        add(0x80U | ((character >> 12U) & 0x3FU));
        add(0x80U | ((character >> 6U) & 0x3FU));
        add(0x80U | (character & 0x3FU));
    } else if (character >= 0x800) {
        add(0xE0U | (character >> 12U));
        add(0x80U | ((character >> 6U) & 0x3FU));
        add(0x80U | (character & 0x3FU));
    } else if (character >= 0x80) {
        add(0xC0U | (character >> 6U));
        add(0x80U | (character & 0x3FU));
    } else {
        add(character);
    }
}

} // namespace nimbra::mrctl
