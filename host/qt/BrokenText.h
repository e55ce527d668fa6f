#pragma once

#include "platform/views/AttributedString.h"
#include "platform/views/Geometry.h"

#include <QFont>
#include <QList>
#include <QString>

namespace nimbra::window {

class WindowMetrics;

/// A text in a window's fonts, broken into the lines on which it is drawn. Main queue only.
class BrokenText {
public:
    /// Lines of at most `width` points, at most `numberOfLines` of them unless that is 0. `metrics`
    /// says the fonts and is not kept.
    BrokenText(const AttributedString& text, const WindowMetrics& metrics, double width,
               int numberOfLines);

    /// In whole points, rounded up.
    [[nodiscard]] Size size() const;
    /// The lines as HTML, to be drawn without wrapping.
    [[nodiscard]] QString html(bool mirrored) const;

private:
    struct Stretch {
        QString text;
        QFont font;
    };
    struct Paragraph {
        QList<Stretch> stretches;
        /// Where nothing stands in it.
        QFont emptyFont;
        ParagraphStyle style;
        bool rightToLeft = false;
    };
    struct Line {
        QList<Stretch> stretches;
        QFont emptyFont;
        TextAlignment alignment = TextAlignment::left;
        bool rightToLeft = false;
        double width = 0;
        double height = 0;
        /// Before the next line, in points.
        double gap = 0;
    };

    [[nodiscard]] static QList<Paragraph> paragraphsOf(const AttributedString& text,
                                                       const WindowMetrics& metrics);
    /// Adds the lines of a paragraph, up to `_most`. Whether everything has found room.
    bool add(const Paragraph& paragraph);
    /// Takes the blanks off the end of a line.
    static void endWithoutBlanks(QList<Stretch>& stretches);
    /// Lets the last line, which begins `start` characters into `paragraph`, show that the text
    /// goes on.
    void endWithEllipsis(const Paragraph& paragraph, qsizetype start);
    /// `stretches` as a line of `paragraph` that nothing breaks.
    [[nodiscard]] static Line lineOf(const QList<Stretch>& stretches, const Paragraph& paragraph);
    /// The characters from `start` on, `length` of them.
    [[nodiscard]] static QList<Stretch> part(const QList<Stretch>& stretches, qsizetype start,
                                             qsizetype length);

    double _width;
    qsizetype _most;
    QList<Line> _lines;
    /// Where in its paragraph the last line begins.
    qsizetype _start = 0;
};

} // namespace nimbra::window
