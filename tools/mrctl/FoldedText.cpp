#include "tools/mrctl/FoldedText.h"

#include "tools/mrctl/Characters.h"
#include "tools/mrctl/DecodedText.h"

#include <array>

namespace nimbra::mrctl {

namespace {

bool isMark(char32_t character) {
    return (character >= 0x300 && character <= 0x36F) || character == 0x3099 ||
           character == 0x309A || (character >= 0xFE00 && character <= 0xFE0F);
}

/// Whether `character` is a sign or a blank between words.
bool isSign(char32_t character) {
    if (character < 0x80) {
        return !isAlphanumeric(static_cast<char>(character));
    }
    return character < 0xC0 || character == 0xD7 || character == 0xF7 ||
           (character >= 0x2000 && character <= 0x206F) ||
           (character >= 0x3000 && character <= 0x303F);
}

/// The letters of Latin from U+00C0 to U+017F without their accents.
constexpr std::array<std::string_view, 192> latin{
    "a", "a", "a",  "a",  "ae", "a", "ae", "c", "e",  "e", "e",  "ee", "i",  "i", "i",  "ie",
    "d", "n", "o",  "o",  "o",  "o", "oe", "",  "oe", "u", "u",  "u",  "ue", "y", "th", "ss",
    "a", "a", "a",  "a",  "ae", "a", "ae", "c", "e",  "e", "e",  "ee", "i",  "i", "i",  "ie",
    "d", "n", "o",  "o",  "o",  "o", "oe", "",  "oe", "u", "u",  "u",  "ue", "y", "th", "ye",
    "a", "a", "a",  "a",  "a",  "a", "c",  "c", "c",  "c", "c",  "c",  "c",  "c", "d",  "d",
    "d", "d", "e",  "e",  "e",  "e", "e",  "e", "e",  "e", "e",  "e",  "g",  "g", "g",  "g",
    "g", "g", "g",  "g",  "h",  "h", "h",  "h", "i",  "i", "i",  "i",  "i",  "i", "i",  "i",
    "i", "i", "ij", "ij", "j",  "j", "k",  "k", "k",  "l", "l",  "l",  "l",  "l", "l",  "l",
    "l", "l", "l",  "n",  "n",  "n", "n",  "n", "n",  "n", "ng", "ng", "o",  "o", "o",  "o",
    "o", "o", "oe", "oe", "r",  "r", "r",  "r", "r",  "r", "s",  "s",  "s",  "s", "s",  "s",
    "s", "s", "t",  "t",  "t",  "t", "t",  "t", "u",  "u", "u",  "u",  "u",  "u", "u",  "u",
    "u", "u", "u",  "u",  "w",  "w", "y",  "y", "ye", "z", "z",  "z",  "z",  "z", "z",  "s"};

/// A letter of Greek or Cyrillic as the small one without an accent.
char32_t smallLetter(char32_t character) {
    if (character >= 0x391 && character <= 0x3A9) {
        return character + 0x20;
    }
    if (character >= 0x400 && character <= 0x40F) {
        character += 0x50;
    } else if (character >= 0x410 && character <= 0x42F) {
        character += 0x20;
    }
    switch (character) {
    case 0x386:
    case 0x3AC:
        return 0x3B1;
    case 0x388:
    case 0x3AD:
        return 0x3B5;
    case 0x389:
    case 0x3AE:
        return 0x3B7;
    case 0x38A:
    case 0x3AF:
        return 0x3B9;
    case 0x38C:
    case 0x3CC:
        return 0x3BF;
    case 0x38E:
    case 0x3CD:
        return 0x3C5;
    case 0x38F:
    case 0x3CE:
        return 0x3C9;
    case 0x3C2:
        return 0x3C3;
    case 0x439: // with a breve
        return 0x438;
    default:
        return character;
    }
}

std::string folded(char32_t character) {
    // The two dots over a letter are as good as an "e" behind it.
    if (character == 0x308) {
        return "e";
    }
    if (isMark(character)) {
        return {};
    }
    std::string text;
    if (character >= 0xC0 && character < 0xC0 + latin.size()) {
        text = latin.at(character - 0xC0);
    } else if (character == 0x451 || character == 0x401) { // with two dots
        appendCharacter(0x435, text);
        text += 'e';
    } else if (character == 0x457 || character == 0x407) {
        appendCharacter(0x456, text);
        text += 'e';
    } else if (character >= 0xAC00 && character <= 0xD7A3) {
        // A syllable of Korean is two or three letters.
        const char32_t number = character - 0xAC00;
        appendCharacter(0x1100 + (number / 588), text);
        appendCharacter(0x1161 + ((number % 588) / 28), text);
        if (number % 28 > 0) {
            appendCharacter(0x11A7 + (number % 28), text);
        }
    } else {
        appendCharacter(smallLetter(character), text);
    }
    return lowerCase(text);
}

} // namespace

FoldedText::FoldedText(std::string_view source) {
    const DecodedText decoded(source);
    std::size_t count = 0;
    bool isInGap = false;
    for (std::size_t index = 0; index < decoded.text.size();) {
        const std::size_t begin = index;
        const char32_t character = nextCharacter(decoded.text, index);
        if (isSign(character)) {
            count += isInGap ? 0U : 1U;
            isInGap = true;
            continue;
        }
        isInGap = false;
        text += folded(character);
        begins.resize(text.size(), decoded.begins[begin]);
        ends.resize(text.size(), decoded.ends[index - 1]);
        gaps.resize(text.size(), count);
    }
    gaps.push_back(count);
}

} // namespace nimbra::mrctl
