#include "host/qt/BrokenText.h"

#include "host/qt/WindowMetrics.h"

#include <QTextBoundaryFinder>
#include <QTextCharFormat>
#include <QTextLayout>
#include <QTextOption>
#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

namespace nimbra::window {

namespace {

using namespace Qt::StringLiterals;

/// The font engine counts in 1/64 pixels.
constexpr double kWidest = 1 << 24;
constexpr QChar kEllipsis(0x2026);
constexpr QChar kSoftHyphen(0x00AD);
constexpr QChar kJoiner(0x200D);

double numberOr0(double number) {
    return std::isfinite(number) ? number : 0;
}

/// A character as it is set: line ends of every kind are line feeds, a tab is a blank, and what
/// the engine uses for purposes of its own, or cannot show, is the character for that.
QChar setCharacter(QChar character) {
    switch (character.unicode()) {
    case u'\n':
    case u'\v':
    case u'\f':
    case u'\r':
    case 0x0085:
    case QChar::LineSeparator:
    case QChar::ParagraphSeparator:
        return u'\n';
    case u'\t':
        return u' ';
    default:
        break;
    }
    const char16_t unicode = character.unicode();
    const bool isControl = unicode < u' ' || (unicode >= 0x7F && unicode < 0xA0);
    const bool isInternal = (unicode >= 0xFDD0 && unicode <= 0xFDEF) || unicode >= 0xFFFE ||
                            unicode == QChar::ObjectReplacementCharacter;
    return isControl || isInternal ? QChar(QChar::ReplacementCharacter) : character;
}

QString setText(const std::string& utf8) {
    QString text = QString::fromStdString(utf8);
    text.replace("\r\n"_L1, "\n"_L1);
    std::ranges::transform(text, text.begin(), setCharacter);
    return text;
}

/// Whether a line may end with it without showing.
bool isBlank(QChar character) {
    return character.isSpace() && character != QChar::Nbsp;
}

/// Whether the letters on both sides of `position` are written in one stroke, as Arabic ones are,
/// which they stay on two lines.
bool isJoined(const QString& text, qsizetype position) {
    const auto joins = [](QChar character) {
        return character.joiningType() != QChar::Joining_None &&
               character.joiningType() != QChar::Joining_Transparent;
    };
    return joins(text[position - 1]) && joins(text[position]);
}

QString fontStyle(const QFont& font) {
    return u"font-size:%1px;font-weight:%2"_s.arg(font.pixelSize()).arg(font.weight());
}

QLatin1String edgeOf(TextAlignment alignment, bool mirrored) {
    if (alignment == TextAlignment::center) {
        return "center"_L1;
    }
    return (alignment == TextAlignment::left) == mirrored ? "right"_L1 : "left"_L1;
}

/// The stretches as one text, laid out as the elements of the window do it.
template <typename Stretches>
void prepare(QTextLayout& layout, const Stretches& stretches, bool rightToLeft,
             QTextOption::WrapMode mode) {
    QString text;
    QList<QTextLayout::FormatRange> formats;
    for (const auto& stretch : stretches) {
        QTextCharFormat format;
        format.setFont(stretch.font);
        formats.append({.start = static_cast<int>(text.size()),
                        .length = static_cast<int>(stretch.text.size()),
                        .format = format});
        text += stretch.text;
    }
    QTextOption option;
    option.setTextDirection(rightToLeft ? Qt::RightToLeft : Qt::LeftToRight);
    option.setWrapMode(mode);
    option.setUseDesignMetrics(true);
    layout.setText(text);
    layout.setFormats(formats);
    layout.setTextOption(option);
}

QTextLine nextLine(QTextLayout& layout, double width) {
    QTextLine line = layout.createLine();
    if (line.isValid()) {
        line.setLeadingIncluded(true);
        line.setLineWidth(width);
    }
    return line;
}

double heightOf(const QTextLine& line) {
    return std::ceil(line.ascent() + line.descent() + line.leading());
}

} // namespace

BrokenText::BrokenText(const AttributedString& text, const WindowMetrics& metrics, double width,
                       int numberOfLines)
    : _width(width > 0 ? std::min(width, kWidest) : 0),
      _most(numberOfLines > 0 ? numberOfLines : std::numeric_limits<qsizetype>::max()) {
    const QList<Paragraph> paragraphs = paragraphsOf(text, metrics);
    for (qsizetype i = 0; i < paragraphs.size(); ++i) {
        const bool fits = add(paragraphs[i]);
        if (!fits || (_lines.size() == _most && i + 1 < paragraphs.size())) {
            endWithEllipsis(paragraphs[i], _start);
            break;
        }
        _lines.last().gap = numberOr0(paragraphs[i].style.paragraphSpacing);
    }
    if (!_lines.isEmpty()) {
        _lines.last().gap = 0;
    }
}

QList<BrokenText::Paragraph> BrokenText::paragraphsOf(const AttributedString& text,
                                                      const WindowMetrics& metrics) {
    QList<Paragraph> paragraphs;
    const auto begin = [&](const TextAttributes& attributes) {
        paragraphs.append({.stretches = {},
                           .emptyFont = metrics.fontFor(attributes.FontAttributeName),
                           .style = attributes.ParagraphStyleAttributeName});
    };
    for (const AttributedString::Run& run : text.runs()) {
        const QFont font = metrics.fontFor(run.attributes.FontAttributeName);
        const QStringList pieces = setText(run.text).split(u'\n');
        for (qsizetype i = 0; i < pieces.size(); ++i) {
            // After a line feed, which says how high a line is that stays empty.
            if (i > 0 || paragraphs.isEmpty()) {
                begin(run.attributes);
            }
            if (pieces[i].isEmpty() && i + 1 == pieces.size()) {
                continue;
            }
            Paragraph& paragraph = paragraphs.last();
            if (paragraph.stretches.isEmpty()) {
                // Of its first character, be it the line feed at its end.
                paragraph.style = run.attributes.ParagraphStyleAttributeName;
            }
            if (!pieces[i].isEmpty()) {
                paragraph.stretches.append({.text = pieces[i], .font = font});
            }
        }
    }
    for (Paragraph& paragraph : paragraphs) {
        QString letters;
        for (const Stretch& stretch : std::as_const(paragraph.stretches)) {
            letters += stretch.text;
        }
        paragraph.rightToLeft = letters.isRightToLeft();
    }
    return paragraphs;
}

bool BrokenText::add(const Paragraph& paragraph) {
    _start = 0;
    if (paragraph.stretches.isEmpty()) {
        _lines.append(lineOf({}, paragraph));
        return true;
    }
    QTextLayout layout;
    prepare(layout, paragraph.stretches, paragraph.rightToLeft,
            QTextOption::WrapAtWordBoundaryOrAnywhere);
    layout.beginLayout();
    qsizetype end = 0;
    const QString letters = layout.text();
    const qsizetype length = letters.size();
    while (end < length && _lines.size() < _most) {
        const QTextLine line = nextLine(layout, _width);
        _start = line.textStart();
        end = _start + line.textLength();
        QList<Stretch> stretches = part(paragraph.stretches, _start, end - _start);
        if (end < length && stretches.last().text.endsWith(kSoftHyphen)) {
            // It shows at a break alone, which the text by itself does not have here.
            stretches.last().text.back() = u'-';
        }
        if (_start > 0 && isJoined(letters, _start)) {
            stretches.first().text.prepend(kJoiner);
        }
        if (end < length && isJoined(letters, end)) {
            stretches.last().text.append(kJoiner);
        }
        endWithoutBlanks(stretches);
        // As it is drawn, by itself: without its blanks, and with no kerning over its ends.
        _lines.append(lineOf(stretches, paragraph));
    }
    layout.endLayout();
    return end == length;
}

void BrokenText::endWithoutBlanks(QList<Stretch>& stretches) {
    while (!stretches.isEmpty()) {
        QString& text = stretches.last().text;
        while (!text.isEmpty() && isBlank(text.back())) {
            text.chop(1);
        }
        if (!text.isEmpty()) {
            return;
        }
        stretches.removeLast();
    }
}

void BrokenText::endWithEllipsis(const Paragraph& paragraph, qsizetype start) {
    const QList<Stretch> rest =
        part(paragraph.stretches, start, std::numeric_limits<qsizetype>::max() - start);
    // As many characters as there is room for, though a word be cut; fewer for the ellipsis.
    QTextLayout layout;
    prepare(layout, rest, paragraph.rightToLeft, QTextOption::WrapAnywhere);
    layout.beginLayout();
    const QTextLine line = nextLine(layout, _width);
    qsizetype end = line.isValid() ? line.textLength() : 0;
    layout.endLayout();
    const QString letters = layout.text();
    QTextBoundaryFinder characters(QTextBoundaryFinder::Grapheme, letters);
    Line last;
    while (true) {
        while (end > 0 && isBlank(letters[end - 1])) {
            --end;
        }
        QList<Stretch> stretches = part(rest, 0, end);
        if (stretches.isEmpty()) {
            const QFont font = rest.isEmpty() ? paragraph.emptyFont : rest.first().font;
            stretches.append({.text = {}, .font = font});
        }
        stretches.last().text += kEllipsis;
        last = lineOf(stretches, paragraph);
        if (end == 0 || last.width <= _width) {
            break;
        }
        characters.setPosition(end);
        end = std::max<qsizetype>(characters.toPreviousBoundary(), 0);
    }
    _lines.last() = std::move(last);
}

BrokenText::Line BrokenText::lineOf(const QList<Stretch>& stretches, const Paragraph& paragraph) {
    QTextLayout layout;
    if (stretches.isEmpty()) {
        const QList<Stretch> blank{{.text = u" "_s, .font = paragraph.emptyFont}};
        prepare(layout, blank, paragraph.rightToLeft, QTextOption::NoWrap);
    } else {
        prepare(layout, stretches, paragraph.rightToLeft, QTextOption::NoWrap);
    }
    layout.beginLayout();
    const QTextLine line = nextLine(layout, kWidest);
    layout.endLayout();
    return {.stretches = stretches,
            .emptyFont = paragraph.emptyFont,
            .alignment = paragraph.style.alignment,
            .rightToLeft = paragraph.rightToLeft,
            .width = stretches.isEmpty() ? 0 : line.naturalTextWidth(),
            .height = heightOf(line),
            .gap = numberOr0(paragraph.style.lineSpacing)};
}

QList<BrokenText::Stretch> BrokenText::part(const QList<Stretch>& stretches, qsizetype start,
                                            qsizetype length) {
    QList<Stretch> found;
    const qsizetype end = start + length;
    qsizetype at = 0;
    for (const Stretch& stretch : stretches) {
        const qsizetype from = std::max(start - at, qsizetype(0));
        const qsizetype to = std::min(end - at, stretch.text.size());
        if (from < to) {
            found.append({.text = stretch.text.mid(from, to - from), .font = stretch.font});
        }
        at += stretch.text.size();
    }
    return found;
}

Size BrokenText::size() const {
    Size size;
    for (const Line& line : _lines) {
        size.width = std::max(size.width, line.width);
        size.height += line.height + line.gap;
    }
    return {.width = std::ceil(size.width), .height = std::max(0.0, std::ceil(size.height))};
}

QString BrokenText::html(bool mirrored) const {
    QString html;
    for (const Line& line : _lines) {
        html +=
            u"<p dir=\"%1\" align=\"%2\" style=\"margin:0px;text-indent:0px;"
            u"white-space:pre-wrap;line-height:%3px;-qt-line-height-type:line-distance;%4%5\">"_s
                .arg(line.rightToLeft ? "rtl"_L1 : "ltr"_L1, edgeOf(line.alignment, mirrored),
                     QString::number(line.gap, 'f'),
                     line.stretches.isEmpty() ? "-qt-paragraph-type:empty;"_L1 : ""_L1,
                     fontStyle(line.emptyFont));
        for (const Stretch& stretch : line.stretches) {
            html += u"<span style=\""_s + fontStyle(stretch.font) + u"\">"_s +
                    stretch.text.toHtmlEscaped() + u"</span>"_s;
        }
        html += line.stretches.isEmpty() ? "<br /></p>"_L1 : "</p>"_L1;
    }
    return html;
}

} // namespace nimbra::window
