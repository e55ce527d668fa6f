#pragma once

#include "platform/views/AttributedString.h"
#include "platform/views/Geometry.h"

#include <cstddef>
#include <string_view>
#include <vector>

namespace nimbra::host {

/// Breaks a text into lines, and measures them, in characters that are all half as wide as they are
/// large and 1.2 times as high. Takes the text from its beginning to its end, stretch by stretch,
/// each of which is there until the size has been taken.
class TextLines {
public:
    /// Lines of at most `width` points, of which those after the first `most` are left out.
    TextLines(double width, std::size_t most) : _width(width), _most(most) {}

    void add(const AttributedString::Run& run);
    /// Ends the text, which is not empty. To be called once.
    [[nodiscard]] Size size();

private:
    /// In which the same number mostly comes many times over: those in a row are multiplied, so
    /// that they are rounded once.
    class Sum {
    public:
        void add(double number, std::size_t times = 1);
        [[nodiscard]] double total() const {
            return _before + (static_cast<double>(_times) * _number);
        }

    private:
        double _before = 0;
        double _number = 0;
        std::size_t _times = 0;
    };
    /// Characters of one size that stand side by side.
    struct Stretch {
        double pointSize = 0;
        std::size_t characters = 0;
    };
    struct Line {
        Sum pointSizes;
        double tallest = 0;

        void add(const Stretch& stretch);
        [[nodiscard]] double width() const { return pointSizes.total() / 2; }
    };

    void addLetters(std::string_view letters, const TextAttributes& attributes);
    void addBlank(const TextAttributes& attributes);
    void beginParagraphWith(const TextAttributes& attributes);
    void endWord();
    /// Null at the end of the text.
    void endParagraph(const TextAttributes* lineFeed);
    /// `paragraph` is what counts for the whole of it: the line spacing, and how high a line is on
    /// which nothing is left.
    void endLine(const TextAttributes& paragraph);
    /// Whether `line`, which ends with `last`, passes the width. The small rounding of a layout
    /// does not make it.
    [[nodiscard]] bool isTooWide(const Line& line, const Stretch& last) const;

    double _width;
    std::size_t _most;

    /// What of the current line is certain, the blanks after it, which stay only if something
    /// follows them on their line, and the letters after these.
    Line _line;
    std::vector<Stretch> _blanks;
    std::vector<Stretch> _word;

    /// Of the first character of the paragraph, and of the line feed before it; null while there is
    /// none.
    const TextAttributes* _first = nullptr;
    const TextAttributes* _lineFeed = nullptr;
    /// The room between the line before and this one, in points; none before the first.
    double _gap = 0;

    std::size_t _lines = 0;
    double _widest = 0;
    Sum _heights;
    Sum _gaps;
};

} // namespace nimbra::host
