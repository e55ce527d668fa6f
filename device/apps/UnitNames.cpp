#include "device/apps/UnitNames.h"

#include <ranges>
#include <vector>

namespace nimbra::device {

namespace {

bool standsForItself(char character) {
    return (character >= '0' && character <= '9') || (character >= 'A' && character <= 'Z') ||
           (character >= 'a' && character <= 'z') || character == ':' || character == '_' ||
           character == '.';
}

bool takeStart(std::string_view& text, std::string_view start) {
    const bool starts = text.starts_with(start);
    text.remove_prefix(starts ? start.size() : 0);
    return starts;
}

bool takeEnd(std::string_view& text, std::string_view end) {
    const bool ends = text.ends_with(end);
    text.remove_suffix(ends ? end.size() : 0);
    return ends;
}

std::vector<std::string_view> pieces(std::string_view text) {
    std::vector<std::string_view> pieces;
    for (const auto piece : std::views::split(text, '-')) {
        pieces.emplace_back(piece.begin(), piece.end());
    }
    return pieces;
}

} // namespace

std::string escapedForUnitName(std::string_view text) {
    constexpr std::string_view digits = "0123456789abcdef";
    constexpr unsigned int base = 16;
    std::string escaped;
    for (const char character : text) {
        // A name that starts with "." would be a hidden file's.
        if (standsForItself(character) && (character != '.' || !escaped.empty())) {
            escaped += character;
            continue;
        }
        const auto byte = static_cast<unsigned char>(character);
        escaped += "\\x";
        escaped += digits[byte / base];
        escaped += digits[byte % base];
    }
    return escaped;
}

bool isUnitOfApplication(std::string_view unit, std::string_view identifier) {
    if (!takeStart(unit, "app-")) {
        return false;
    }
    // Only whole pieces are compared: what a piece itself holds of "-" is escaped, so an
    // application that is called like a launcher does not answer for all that this one launched.
    const std::string escaped = escapedForUnitName(identifier);
    if (takeEnd(unit, ".scope")) {
        const auto found = pieces(unit);
        return (found.size() == 2 && found[0] == escaped) ||
               (found.size() == 3 && found[1] == escaped);
    }
    if (takeEnd(unit, ".service")) {
        const auto found = pieces(unit.substr(0, unit.find('@')));
        return found.size() <= 2 && found.back() == escaped;
    }
    return false;
}

} // namespace nimbra::device
