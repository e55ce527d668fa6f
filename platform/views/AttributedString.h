#pragma once

#include "platform/values/Text.h"
#include "platform/views/Font.h"

#include <cstdint>
#include <string>
#include <vector>

namespace nimbra {

/// Where lines stand between the edges; the numbers are the platform's.
enum class TextAlignment : std::uint8_t { left = 0, center = 1, right = 2 };

/// How the lines of a paragraph stand; as made, the platform's default.
struct ParagraphStyle {
    TextAlignment alignment = TextAlignment::left;
    /// Between a paragraph and the next one, in points.
    double paragraphSpacing = 0;
    /// Between two lines of a paragraph, in points; negative to bring them together.
    double lineSpacing = 0;

    friend bool operator==(const ParagraphStyle&, const ParagraphStyle&) = default;
};

/// How a stretch of text is set: a value under each name that an attribute has.
struct TextAttributes {
    Font FontAttributeName;
    /// Of a paragraph, what its first character says counts.
    ParagraphStyle ParagraphStyleAttributeName;

    friend bool operator==(const TextAttributes&, const TextAttributes&) = default;
};

/// A text whose stretches are set each in their own way.
class AttributedString {
public:
    /// A longest stretch of the same attributes; never empty.
    struct Run {
        std::string text;
        TextAttributes attributes;

        friend bool operator==(const Run&, const Run&) = default;
    };

    AttributedString() = default;
    /// `text` in `attributes`; an absent text is an empty one.
    AttributedString(const Text& text, const TextAttributes& attributes);

    [[nodiscard]] const std::vector<Run>& runs() const { return _runs; }
    /// The text alone.
    [[nodiscard]] std::string string() const;

    friend bool operator==(const AttributedString&, const AttributedString&) = default;

protected:
    std::vector<Run> _runs;
};

/// A styled text that grows.
class MutableAttributedString : public AttributedString {
public:
    using AttributedString::AttributedString;

    /// Puts `more` at the end, in its own attributes.
    void appendAttributedString(const AttributedString& more);
};

} // namespace nimbra
