#include "host/qt/WindowMetrics.h"

#include <QGuiApplication>
#include <QQmlComponent>
#include <QQmlEngine>
#include <QQuickItem>
#include <QTextBlock>
#include <QTextDocument>
#include <cmath>
#include <gtest/gtest.h>
#include <limits>
#include <memory>

namespace nimbra::window {
namespace {

constexpr double kUnlimited = std::numeric_limits<double>::infinity();
constexpr double kNoNumber = std::numeric_limits<double>::quiet_NaN();
constexpr auto kArabic = "إعدادات المزامنة عبر الشبكة الخلوية 123 وحالة المستندات";

struct WindowMetricsTest : testing::Test {
    WindowMetrics metrics;
    QFont before = QGuiApplication::font();
    QQmlEngine engine;

    WindowMetricsTest() { QGuiApplication::setFont(QFont(QStringLiteral("DejaVu Sans"))); }
    WindowMetricsTest(const WindowMetricsTest&) = delete;
    WindowMetricsTest& operator=(const WindowMetricsTest&) = delete;
    ~WindowMetricsTest() override { QGuiApplication::setFont(before); }

    static AttributedString set(const Text& text, double pointSize = 17,
                                const ParagraphStyle& style = {}) {
        return {
            text,
            {.FontAttributeName = {.pointSize = pointSize}, .ParagraphStyleAttributeName = style}};
    }

    [[nodiscard]] Size sizeOf(const Text& text, double width = kUnlimited,
                              int numberOfLines = 0) const {
        return metrics.sizeOfText(set(text), width, numberOfLines);
    }
    [[nodiscard]] double line() const { return metrics.lineHeight({.pointSize = 17}); }

    /// A text element of QML with these properties.
    std::unique_ptr<QQuickItem> element(const QByteArray& properties) {
        QQmlComponent component(&engine);
        component.setData("import QtQuick\nText {" + properties + "}", QUrl());
        std::unique_ptr<QObject> made(component.create());
        EXPECT_TRUE(made) << component.errorString().toStdString();
        return std::unique_ptr<QQuickItem>(qobject_cast<QQuickItem*>(made.release()));
    }

    /// What an element of `width` paints of the rich text.
    Size painted(const AttributedString& text, double width, int numberOfLines = 0) {
        const auto item = element("textFormat: Text.RichText; wrapMode: Text.NoWrap");
        if (std::isfinite(width)) {
            item->setWidth(width);
        }
        item->setProperty("text", metrics.richText(text, width, numberOfLines));
        return {.width = item->property("implicitWidth").toDouble(),
                .height = item->property("contentHeight").toDouble()};
    }

    void expectAgreement(const AttributedString& text, int numberOfLines = 0) {
        for (const double width : {20.0, 63.5, 100.0, 150.0, 240.0, 320.0, 1000.0, kUnlimited}) {
            const Size measured = metrics.sizeOfText(text, width, numberOfLines);
            const Size drawn = painted(text, width, numberOfLines);
            EXPECT_EQ(measured.height, std::ceil(drawn.height)) << width;
            EXPECT_EQ(measured.width, std::ceil(drawn.width)) << width;
        }
    }
};

MutableAttributedString mixedText() {
    const ParagraphStyle style{
        .alignment = TextAlignment::center, .paragraphSpacing = 8, .lineSpacing = -2};
    MutableAttributedString text("These devices ", {.FontAttributeName = {.pointSize = 17},
                                                    .ParagraphStyleAttributeName = style});
    text.appendAttributedString(
        {"need to be LARGE",
         {.FontAttributeName = {.pointSize = 32.4, .weight = FontWeight::bold},
          .ParagraphStyleAttributeName = style}});
    text.appendAttributedString(
        {" again & again:\nMac <mini>\n\nانتهى كل شيء الآن بسلام",
         {.FontAttributeName = {.pointSize = 12, .weight = FontWeight::thin},
          .ParagraphStyleAttributeName = style}});
    return text;
}

TEST_F(WindowMetricsTest, AFontIsDrawnInTheApplicationsFamilyAndWholePixels) {
    const QFont font = metrics.fontFor({.pointSize = 17.5, .weight = FontWeight::bold});

    EXPECT_EQ(font.family(), QStringLiteral("DejaVu Sans"));
    EXPECT_EQ(font.pixelSize(), 18);
    EXPECT_EQ(font.weight(), QFont::Bold);
    EXPECT_EQ(metrics.fontFor(Font::_thinSystemFontOfSize(25)).weight(), QFont::Thin);
    EXPECT_EQ(metrics.fontFor(Font::_lightSystemFontOfSize(25)).weight(), QFont::Light);
    EXPECT_EQ(metrics.fontFor({}).weight(), QFont::Normal);
}

TEST_F(WindowMetricsTest, ASizeThatIsNoneIsTheNearestOneThatCanBeDrawn) {
    EXPECT_EQ(metrics.fontFor({.pointSize = 0}).pixelSize(), 1);
    EXPECT_EQ(metrics.fontFor({.pointSize = -17}).pixelSize(), 1);
    EXPECT_EQ(metrics.fontFor({.pointSize = kNoNumber}).pixelSize(), 1);
    EXPECT_EQ(metrics.fontFor({.pointSize = kUnlimited}).pixelSize(), 1000);
}

TEST_F(WindowMetricsTest, TheTextScaleEnlargesEveryFontOnce) {
    const Size usual = sizeOf("Cellular data");

    metrics.setTextScale(2);

    const Font body = metrics.preferredFontForTextStyle(FontTextStyleBody);
    EXPECT_EQ(body.pointSize, 17);
    EXPECT_EQ(metrics.preferredFontForTextStyle(FontTextStyleCaption1).pointSize, 12);
    EXPECT_EQ(metrics.fontFor(body).pixelSize(), 34);
    EXPECT_NEAR(sizeOf("Cellular data").width, 2 * usual.width, 2);
    EXPECT_EQ(sizeOf("Cellular data").height, metrics.lineHeight({.pointSize = 17}));
    EXPECT_NEAR(sizeOf("Cellular data").height, 2 * usual.height, 2);
}

TEST_F(WindowMetricsTest, ATextScaleThatIsNoneIsOne) {
    for (const double scale : {0.0, -2.0, kNoNumber, kUnlimited}) {
        metrics.setTextScale(2);
        metrics.setTextScale(scale);
        EXPECT_EQ(metrics.textScale(), 1);
    }
}

TEST_F(WindowMetricsTest, ControlsGrowWithTheTextAndButtonsFitAFinger) {
    EXPECT_EQ(metrics.progressBarHeight(), 4);
    EXPECT_EQ(metrics.activityIndicatorSize(), (Size{20, 20}));
    EXPECT_EQ(metrics.sizeOfButtonAround({50, 20}), (Size{74, 44}));
    EXPECT_EQ(metrics.sizeOfButtonAround({50, 60}), (Size{74, 72}));

    metrics.setTextScale(1.6);

    EXPECT_EQ(metrics.progressBarHeight(), 6);
    EXPECT_EQ(metrics.activityIndicatorSize(), (Size{32, 32}));
}

TEST_F(WindowMetricsTest, NoTextTakesNoRoom) {
    EXPECT_EQ(sizeOf(Text(), 100), (Size{}));
    EXPECT_EQ(sizeOf("", 100), (Size{}));
    EXPECT_EQ(metrics.richText(AttributedString(), 100, 0), QString());
}

TEST_F(WindowMetricsTest, SizesAreWholePoints) {
    const Size size = sizeOf("Documents & data");

    EXPECT_GT(size.width, 100);
    EXPECT_EQ(size.width, std::ceil(size.width));
    EXPECT_EQ(size.height, line());
    EXPECT_EQ(sizeOf("Documents & data", size.width), size);
    EXPECT_EQ(sizeOf("Documents & data", size.width - 1).height, 2 * line());
}

TEST_F(WindowMetricsTest, ALineEndsAtALineFeedOfAnyKind) {
    EXPECT_EQ(sizeOf("one\ntwo").height, 2 * line());
    EXPECT_EQ(sizeOf("one\r\ntwo").height, 2 * line());
    EXPECT_EQ(sizeOf("one\u2028two\u2029three").height, 3 * line());
    EXPECT_EQ(sizeOf("one\n\ntwo\n").height, 4 * line());
    EXPECT_EQ(sizeOf("\n").height, 2 * line());
}

TEST_F(WindowMetricsTest, BlanksAtABreakTakeNoRoom) {
    const double word = sizeOf("wonder").width;

    const Size size = sizeOf("wonder      wonder", word);

    EXPECT_EQ(size, (Size{word, 2 * line()}));
    EXPECT_EQ(sizeOf("wonder   ").width, word);
    EXPECT_EQ(sizeOf("   "), (Size{0, line()}));
}

TEST_F(WindowMetricsTest, AWordThatDoesNotFitIsBroken) {
    const double word = sizeOf("Datenschutz").width;

    const Size size = sizeOf("Datenschutz", word - 10);

    EXPECT_EQ(size.height, 2 * line());
    EXPECT_LE(size.width, word - 10);
}

TEST_F(WindowMetricsTest, AWidthThatIsNoneIsZero) {
    const Size size = sizeOf("two words", 0);

    EXPECT_GT(size.height, 2 * line());
    EXPECT_EQ(sizeOf("two words", -5), size);
    EXPECT_EQ(sizeOf("two words", -kUnlimited), size);
    EXPECT_EQ(sizeOf("two words", kNoNumber), size);
}

TEST_F(WindowMetricsTest, ALineIsAsHighAsItsLargestLetters) {
    MutableAttributedString text;
    text.appendAttributedString(set("small ", 12));
    text.appendAttributedString(set("large", 40));

    const double large = metrics.lineHeight({.pointSize = 40});
    EXPECT_EQ(metrics.sizeOfText(text, kUnlimited, 0).height, large);
    EXPECT_EQ(metrics.sizeOfText(text, metrics.sizeOfText(set("large", 40), kUnlimited, 0).width, 0)
                  .height,
              large + metrics.lineHeight({.pointSize = 12}));
}

TEST_F(WindowMetricsTest, AnEmptyLineIsAsHighAsTheLineFeedBeforeIt) {
    MutableAttributedString text;
    text.appendAttributedString(set("one\n", 12));
    text.appendAttributedString(set("\n", 40));
    text.appendAttributedString(set("two", 12));

    EXPECT_EQ(metrics.sizeOfText(text, kUnlimited, 0).height,
              3 * metrics.lineHeight({.pointSize = 12}));
}

TEST_F(WindowMetricsTest, SpacingStandsBetweenLinesAndBetweenParagraphs) {
    const auto heightOf = [this](const ParagraphStyle& style, const Text& text, double width) {
        return metrics.sizeOfText(set(text, 17, style), width, 0).height;
    };
    const double word = sizeOf("wonder").width;

    EXPECT_EQ(heightOf({.lineSpacing = -2}, "wonder wonder", word), 2 * line() - 2);
    EXPECT_EQ(heightOf({.lineSpacing = -2}, "wonder", word), line());
    EXPECT_EQ(heightOf({.paragraphSpacing = 8, .lineSpacing = 3}, "wonder wonder\nwonder", word),
              3 * line() + 3 + 8);
    EXPECT_EQ(heightOf({.lineSpacing = -1000}, "wonder wonder", word), 0);
    EXPECT_EQ(heightOf({.paragraphSpacing = kNoNumber, .lineSpacing = kUnlimited},
                       "wonder wonder\nwonder", word),
              3 * line());
}

TEST_F(WindowMetricsTest, WhatPassesTheNumberOfLinesIsLeftOutWithAnEllipsis) {
    const double word = sizeOf("wonder").width;

    EXPECT_EQ(sizeOf("wonder wonder wonder", word, 2).height, 2 * line());
    EXPECT_LE(sizeOf("wonder wonder wonder", word, 2).width, word);
    EXPECT_EQ(sizeOf("one\ntwo", kUnlimited, 1), sizeOf("one…"));
    EXPECT_EQ(sizeOf("one\ntwo", kUnlimited, 2), sizeOf("one\ntwo"));
    EXPECT_EQ(sizeOf("one\ntwo", kUnlimited, -1), sizeOf("one\ntwo"));
    QTextDocument shown;
    shown.setHtml(metrics.richText(set("one wonder more"), sizeOf("one wond…").width, 1));
    EXPECT_EQ(shown.toPlainText(), QStringLiteral("one wond…"));
}

TEST_F(WindowMetricsTest, TheRichTextIsDrawnAsItWasMeasured) {
    expectAgreement(set("Documents and data of all applications that use the drive"));
    expectAgreement(set("one\n\n   three   \nfour\n"));
    expectAgreement(set("Datenschutzgrundverordnung und Verschlüsselung", 25.4));
    expectAgreement(mixedText());
    expectAgreement(mixedText(), 2);
    expectAgreement(set("wonder wonder wonder", 17, {.lineSpacing = 3.25}), 3);
}

TEST_F(WindowMetricsTest, TheRichTextIsDrawnAsItWasMeasuredInOtherScripts) {
    expectAgreement(set(kArabic));
    expectAgreement(set("書類とデータをモバイル通信で同期する"));
    expectAgreement(set("日本 and Übung, שלום 12 % 😀"));
}

TEST_F(WindowMetricsTest, TheRichTextIsDrawnAsItWasMeasuredInTheTextScale) {
    metrics.setTextScale(2);

    expectAgreement(mixedText());
    expectAgreement(set(kArabic));
}

TEST_F(WindowMetricsTest, APlainTextElementThatWrapsHasTheSameBreaks) {
    const auto item = element("wrapMode: Text.Wrap; textFormat: Text.PlainText");
    item->setProperty("font", metrics.fontFor({.pointSize = 17}));
    for (const char* const text :
         {"Documents and data of all applications", "Datenschutzgrundverordnung", kArabic}) {
        item->setProperty("text", QString::fromUtf8(text));
        for (const double width : {40.0, 63.5, 100.0, 150.0, 240.0, 1000.0}) {
            item->setWidth(width);
            EXPECT_EQ(item->property("contentHeight").toDouble(), sizeOf(text, width).height)
                << text << width;
        }
        item->setWidth(sizeOf(text).width);
        EXPECT_EQ(item->property("lineCount").toInt(), 1) << text;
    }
}

TEST_F(WindowMetricsTest, NothingInATextActsAsMarkup) {
    const QString hostile = QStringLiteral("<b>&amp;</b> \"<img src='file:///x'>\" </p> <a "
                                           "href=x>a</a>  two");

    QTextDocument shown;
    shown.setHtml(metrics.richText(set(hostile.toStdString()), kUnlimited, 0));

    EXPECT_EQ(shown.toPlainText(), hostile);
    EXPECT_EQ(shown.blockCount(), 1);
    expectAgreement(set(hostile.toStdString()));
}

TEST_F(WindowMetricsTest, CharactersWithAMeaningToTheEngineAreShownAsUnknown) {
    const Text odd("a\uFDD0b\uFDD1c\uFFFCd\x01"
                   "e\tf");

    QTextDocument shown;
    shown.setHtml(metrics.richText(set(odd), kUnlimited, 0));

    EXPECT_EQ(shown.toPlainText(), QStringLiteral("a\uFFFDb\uFFFDc\uFFFDd\uFFFDe f"));
    expectAgreement(set(odd));
}

TEST_F(WindowMetricsTest, BytesThatAreNoTextAreDrawnAsTheyAreMeasured) {
    expectAgreement(set(std::string("one \x80\xff two")));
}

TEST_F(WindowMetricsTest, ParagraphsSayTheirDirectionAndStandAtTheirEdge) {
    QTextDocument shown;
    const auto alignmentOf = [&](TextAlignment alignment, bool mirrored) {
        shown.setHtml(
            metrics.richText(set(kArabic, 17, {.alignment = alignment}), kUnlimited, 0, mirrored));
        return shown.firstBlock().blockFormat().alignment() & Qt::AlignHorizontal_Mask;
    };

    EXPECT_EQ(alignmentOf(TextAlignment::left, false), Qt::AlignLeft | Qt::AlignAbsolute);
    EXPECT_EQ(alignmentOf(TextAlignment::left, true), Qt::AlignRight | Qt::AlignAbsolute);
    EXPECT_EQ(alignmentOf(TextAlignment::right, false), Qt::AlignRight | Qt::AlignAbsolute);
    EXPECT_EQ(alignmentOf(TextAlignment::right, true), Qt::AlignLeft | Qt::AlignAbsolute);
    EXPECT_EQ(alignmentOf(TextAlignment::center, true), Qt::AlignHCenter);
    EXPECT_EQ(shown.firstBlock().blockFormat().layoutDirection(), Qt::RightToLeft);
}

} // namespace
} // namespace nimbra::window
