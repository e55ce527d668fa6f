#include "host/cli/TextLayout.h"

#include <algorithm>
#include <cstdint>
#include <memory>
#include <unicode/brkiter.h>
#include <unicode/locid.h>
#include <unicode/uchar.h>
#include <unicode/unistr.h>

namespace nimbra::cli {

namespace {

icu::UnicodeString decoded(std::string_view text) {
    return icu::UnicodeString::fromUTF8(
        icu::StringPiece(text.data(), static_cast<std::int32_t>(text.size())));
}

std::string encoded(const icu::UnicodeString& text) {
    std::string utf8;
    return text.toUTF8String(utf8);
}

/// Control characters, line ends, and what turns the direction of all that follows round.
bool movesTheCursor(char16_t character) {
    switch (u_charType(character)) {
    case U_CONTROL_CHAR:
    case U_LINE_SEPARATOR:
    case U_PARAGRAPH_SEPARATOR:
        return true;
    default:
        return character >= u'\u202A' && character <= u'\u202E';
    }
}

std::size_t columnsOf(UChar32 character) {
    switch (u_charType(character)) {
    case U_NON_SPACING_MARK:
    case U_ENCLOSING_MARK:
    case U_FORMAT_CHAR:
        return 0;
    default:
        break;
    }
    switch (u_getIntPropertyValue(character, UCHAR_EAST_ASIAN_WIDTH)) {
    case U_EA_WIDE:
    case U_EA_FULLWIDTH:
        return 2;
    default:
        return 1;
    }
}

std::size_t columnsOf(const icu::UnicodeString& text) {
    std::size_t columns = 0;
    for (std::int32_t index = 0; index < text.length(); index = text.moveIndex32(index, 1)) {
        columns += columnsOf(text.char32At(index));
    }
    return columns;
}

/// Where `text` may be broken, its end included.
std::vector<std::int32_t> breaks(const icu::UnicodeString& text) {
    std::vector<std::int32_t> places;
    UErrorCode status = U_ZERO_ERROR;
    const std::unique_ptr<icu::BreakIterator> iterator(
        icu::BreakIterator::createLineInstance(icu::Locale::getRoot(), status));
    if (U_FAILURE(status)) {
        places.push_back(text.length());
        return places;
    }
    iterator->setText(text);
    iterator->first();
    for (auto place = iterator->next(); place != icu::BreakIterator::DONE;
         place = iterator->next()) {
        places.push_back(place);
    }
    return places;
}

bool endsLine(const icu::UnicodeString& piece) {
    return piece.endsWith(u'\n') != 0 || piece.endsWith(u'\r') != 0;
}

} // namespace

std::size_t displayWidth(std::string_view text) {
    return columnsOf(decoded(text));
}

std::string printable(std::string_view text) {
    const auto isPlain = [](char character) {
        const auto byte = static_cast<unsigned char>(character);
        return byte >= 0x20 && byte < 0x7f;
    };
    if (std::ranges::all_of(text, isPlain)) {
        return std::string(text);
    }
    icu::UnicodeString shown = decoded(text);
    for (std::int32_t index = 0; index < shown.length(); ++index) {
        if (movesTheCursor(shown.charAt(index))) {
            shown.setCharAt(index, u' ');
        }
    }
    return encoded(shown);
}

std::vector<std::string> wrapped(std::string_view text, std::size_t width) {
    const icu::UnicodeString whole = decoded(text);
    std::vector<std::string> lines;
    icu::UnicodeString line;
    const auto finishLine = [&] {
        lines.push_back(printable(encoded(line.trim())));
        line.remove();
    };
    std::int32_t start = 0;
    for (const std::int32_t end : breaks(whole)) {
        const icu::UnicodeString piece = whole.tempSubStringBetween(start, end);
        start = end;
        // Blanks at the end of a line may hang over.
        const icu::UnicodeString visible = icu::UnicodeString(piece).trim();
        if (!line.isEmpty() && columnsOf(line) + columnsOf(visible) > width) {
            finishLine();
        }
        line += piece;
        if (endsLine(piece)) {
            finishLine();
        }
    }
    if (!line.isEmpty()) {
        finishLine();
    }
    return lines;
}

} // namespace nimbra::cli
