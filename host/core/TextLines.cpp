#include "host/core/TextLines.h"

#include <algorithm>
#include <utility>

namespace nimbra::host {

namespace {

std::size_t codePointsIn(std::string_view utf8) {
    return static_cast<std::size_t>(std::ranges::count_if(utf8, [](char byte) {
        constexpr unsigned kindMask = 0xC0;
        constexpr unsigned continuation = 0x80;
        return (static_cast<unsigned char>(byte) & kindMask) != continuation;
    }));
}

} // namespace

void TextLines::Sum::add(double number, std::size_t times) {
    if (number != _number) {
        _before = total();
        _number = number;
        _times = 0;
    }
    _times += times;
}

void TextLines::Line::add(const Stretch& stretch) {
    pointSizes.add(stretch.pointSize, stretch.characters);
    tallest = std::max(tallest, stretch.pointSize);
}

void TextLines::add(const AttributedString::Run& run) {
    std::string_view rest = run.text;
    while (!rest.empty() && _lines < _most) {
        const std::size_t end = std::min(rest.find_first_of(" \n"), rest.size());
        if (end > 0) {
            addLetters(rest.substr(0, end), run.attributes);
            rest.remove_prefix(end);
        } else {
            if (rest.front() == ' ') {
                addBlank(run.attributes);
            } else {
                endParagraph(&run.attributes);
            }
            rest.remove_prefix(1);
        }
    }
}

Size TextLines::size() {
    endParagraph(nullptr);
    constexpr double lineHeight = 6;
    constexpr double perPointSize = 5;
    // Divided at the very end, as it is the division that rounds.
    return {.width = _widest,
            .height =
                (_heights.total() * lineHeight + _gaps.total() * perPointSize) / perPointSize};
}

void TextLines::addLetters(std::string_view letters, const TextAttributes& attributes) {
    beginParagraphWith(attributes);
    if (const std::size_t characters = codePointsIn(letters); characters > 0) {
        _word.push_back(
            {.pointSize = attributes.FontAttributeName.pointSize, .characters = characters});
    }
}

void TextLines::addBlank(const TextAttributes& attributes) {
    beginParagraphWith(attributes);
    endWord();
    _blanks.push_back({.pointSize = attributes.FontAttributeName.pointSize, .characters = 1});
}

void TextLines::beginParagraphWith(const TextAttributes& attributes) {
    if (_first == nullptr) {
        _first = &attributes;
    }
}

void TextLines::endWord() {
    if (_word.empty()) {
        return;
    }
    Line longer = _line;
    for (const Stretch& blank : _blanks) {
        longer.add(blank);
    }
    for (const Stretch& part : _word) {
        longer.add(part);
    }
    if (!_blanks.empty() && isTooWide(longer, _word.back())) {
        endLine(*_first);
        for (const Stretch& part : _word) {
            _line.add(part);
        }
    } else {
        _line = longer;
    }
    _blanks.clear();
    _word.clear();
}

void TextLines::endParagraph(const TextAttributes* lineFeed) {
    endWord();
    for (const Stretch& blank : std::exchange(_blanks, {})) {
        Line longer = _line;
        longer.add(blank);
        if (isTooWide(longer, blank)) {
            break;
        }
        _line = longer;
    }
    const TextAttributes* const before = std::exchange(_lineFeed, lineFeed);
    if (_first != nullptr) {
        endLine(*_first);
    } else if (before != nullptr || lineFeed != nullptr) {
        endLine(before != nullptr ? *before : *lineFeed);
    }
    if (const TextAttributes* const styled = _first != nullptr ? _first : lineFeed) {
        _gap = styled->ParagraphStyleAttributeName.paragraphSpacing;
    }
    _first = nullptr;
}

void TextLines::endLine(const TextAttributes& paragraph) {
    const Line line = std::exchange(_line, {});
    if (_lines == _most) {
        return;
    }
    _gaps.add(_gap);
    ++_lines;
    _gap = paragraph.ParagraphStyleAttributeName.lineSpacing;
    _heights.add(line.tallest > 0 ? line.tallest : paragraph.FontAttributeName.pointSize);
    _widest = std::max(_widest, line.width());
}

bool TextLines::isTooWide(const Line& line, const Stretch& last) const {
    constexpr double tolerance = 1e-6;
    return line.width() > _width + (tolerance * last.pointSize / 2);
}

} // namespace nimbra::host
