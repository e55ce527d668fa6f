#pragma once

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace nimbra::mrctl {

/// A text without all in which two spellings of a name differ: decoded, without signs and blanks,
/// in small letters, umlauts as "ae", "oe" and "ue", and without other accents, be they a part of
/// their letter or a character behind it. Letters of Latin, Greek and Cyrillic have small ones.
struct FoldedText {
    explicit FoldedText(std::string_view source);

    std::string text;
    /// Where what became each byte of `text` begins and ends in the source.
    std::vector<std::size_t> begins;
    std::vector<std::size_t> ends;
    /// How many times signs or blanks, however many together, stood before each byte, and before
    /// the end.
    std::vector<std::size_t> gaps;
};

} // namespace nimbra::mrctl
