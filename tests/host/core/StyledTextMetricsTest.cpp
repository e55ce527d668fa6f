#include "host/core/FixedViewMetrics.h"

#include <cstddef>
#include <gtest/gtest.h>
#include <initializer_list>
#include <limits>
#include <string>

namespace nimbra::host {
namespace {

constexpr double kUnlimited = std::numeric_limits<double>::infinity();

/// A stretch of text, in letters that are 10 points wide and lines that are 24 points high if
/// nothing else is said.
struct Piece {
    Text text;
    double pointSize = 20;
    double lineSpacing = 0;
    double paragraphSpacing = 0;
    FontWeight weight = FontWeight::regular;
};

AttributedString textOf(std::initializer_list<Piece> pieces) {
    MutableAttributedString text;
    for (const Piece& piece : pieces) {
        text.appendAttributedString(AttributedString(
            piece.text,
            {.FontAttributeName = {.pointSize = piece.pointSize, .weight = piece.weight},
             .ParagraphStyleAttributeName = {.paragraphSpacing = piece.paragraphSpacing,
                                             .lineSpacing = piece.lineSpacing}}));
    }
    return text;
}

struct StyledTextMetricsTest : testing::Test {
    FixedViewMetrics metrics;

    [[nodiscard]] Size sizeOf(std::initializer_list<Piece> pieces, double width = kUnlimited,
                              int numberOfLines = 0) const {
        return metrics.sizeOfText(textOf(pieces), width, numberOfLines);
    }
};

TEST_F(StyledTextMetricsTest, EachCharacterIsAsWideAsItsOwnFontSays) {
    EXPECT_EQ(sizeOf({{.text = "four"}, {.text = "ßix", .pointSize = 30}}).width, 40 + 45);
}

TEST_F(StyledTextMetricsTest, ALineIsAsHighAsTheTallestCharacterOnIt) {
    EXPECT_EQ(sizeOf({{.text = "low "}, {.text = "high", .pointSize = 30}, {.text = " low"}}),
              (Size{40 + 60 + 40, 36}));
    EXPECT_EQ(sizeOf({{.text = "low\n"}, {.text = "high\n", .pointSize = 30}, {.text = "low"}}),
              (Size{60, 24 + 36 + 24}));
}

TEST_F(StyledTextMetricsTest, TheLineFeedAndDroppedBlanksDoNotMakeALineHigher) {
    EXPECT_EQ(sizeOf({{.text = "one"}, {.text = "\n", .pointSize = 30}, {.text = "two"}}),
              (Size{30, 48}));
    EXPECT_EQ(sizeOf({{.text = "one"}, {.text = " ", .pointSize = 30}, {.text = "two"}}, 40),
              (Size{30, 48}));
    EXPECT_EQ(sizeOf({{.text = "one"}, {.text = " ", .pointSize = 30}, {.text = "two"}}),
              (Size{75, 36}));
}

TEST_F(StyledTextMetricsTest, AWordMaySpanStretches) {
    const Piece front{.text = "a won"};
    const Piece back{.text = "der", .weight = FontWeight::bold};

    EXPECT_EQ(sizeOf({front, back}, 80), (Size{80, 24}));
    EXPECT_EQ(sizeOf({front, back}, 79), (Size{60, 48}));
    EXPECT_EQ(sizeOf({front, back, {.text = "s fade"}}, 75), (Size{70, 72}));
}

TEST_F(StyledTextMetricsTest, ACodePointIsCountedOnceWhereStretchesCutIt) {
    EXPECT_EQ(sizeOf({{.text = "\xC3"}, {.text = "\xBC", .weight = FontWeight::bold}}),
              (Size{10, 24}));
}

TEST_F(StyledTextMetricsTest, LineSpacingStandsBetweenTheLinesOfAParagraph) {
    EXPECT_EQ(sizeOf({{.text = "one two six", .lineSpacing = 5}}, 30), (Size{30, 72 + 10}));
    EXPECT_EQ(sizeOf({{.text = "one two six", .lineSpacing = -2}}, 30), (Size{30, 72 - 4}));
    EXPECT_EQ(sizeOf({{.text = "one\ntwo\nsix", .lineSpacing = 5}}), (Size{30, 72}));
}

TEST_F(StyledTextMetricsTest, ParagraphSpacingStandsBehindEachParagraphButTheLast) {
    EXPECT_EQ(sizeOf({{.text = "one\ntwo\nsix", .paragraphSpacing = 8}}), (Size{30, 72 + 16}));
    EXPECT_EQ(sizeOf({{.text = "one two", .paragraphSpacing = 8}}, 30), (Size{30, 48}));
    EXPECT_EQ(sizeOf({{.text = "one two\nsix", .lineSpacing = -2, .paragraphSpacing = 8}}, 30),
              (Size{30, 72 - 2 + 8}));
}

TEST_F(StyledTextMetricsTest, TheFirstCharacterOfAParagraphGivesItItsStyle) {
    EXPECT_EQ(sizeOf({{.text = "o", .lineSpacing = 3, .paragraphSpacing = 8},
                      {.text = "ne two\ns", .lineSpacing = 100, .paragraphSpacing = 200},
                      {.text = "ix two\none"}},
                     30),
              (Size{30, (5 * 24) + 3 + 8 + 100 + 200}));
}

TEST_F(StyledTextMetricsTest, AnEmptyLineIsAsHighAsTheLineFeedBeforeIt) {
    EXPECT_EQ(sizeOf({{.text = "one"}, {.text = "\n", .pointSize = 30}, {.text = "\ntwo"}}),
              (Size{30, 24 + 36 + 24}));
    EXPECT_EQ(sizeOf({{.text = "one"}, {.text = "\n", .pointSize = 30}}), (Size{30, 24 + 36}));
    EXPECT_EQ(sizeOf({{.text = "\n", .pointSize = 30}, {.text = "one"}}), (Size{30, 36 + 24}));
}

TEST_F(StyledTextMetricsTest, AnEmptyParagraphHasTheStyleOfItsLineFeed) {
    EXPECT_EQ(sizeOf({{.text = "one\n"}, {.text = "\n", .paragraphSpacing = 8}, {.text = "two"}}),
              (Size{30, 72 + 8}));
    EXPECT_EQ(sizeOf({{.text = "one\n", .paragraphSpacing = 8}, {.text = "\n"}, {.text = "two"}}),
              (Size{30, 72 + 8}));
    EXPECT_EQ(sizeOf({{.text = "one\n", .paragraphSpacing = 8}}), (Size{30, 48 + 8}));
}

TEST_F(StyledTextMetricsTest, ALineOfDroppedBlanksIsAsHighAsItsFirst) {
    EXPECT_EQ(sizeOf({{.text = " ", .pointSize = 30}, {.text = "word"}}, 40), (Size{40, 36 + 24}));
    EXPECT_EQ(sizeOf({{.text = "  ", .pointSize = 30}}, 20), (Size{15, 36}));
    EXPECT_EQ(sizeOf({{.text = "  ", .pointSize = 30}}, 0), (Size{0, 36}));
}

TEST_F(StyledTextMetricsTest, LinesThatAreLeftOutTakeNoRoomNorTheSpacingBeforeThem) {
    const Piece paragraphs{.text = "one two\nthree", .lineSpacing = 3, .paragraphSpacing = 8};

    EXPECT_EQ(sizeOf({paragraphs}, 30, 1), (Size{30, 24}));
    EXPECT_EQ(sizeOf({paragraphs}, 30, 2), (Size{30, 48 + 3}));
    EXPECT_EQ(sizeOf({paragraphs}, 30, 3), (Size{50, 72 + 3 + 8}));
    EXPECT_EQ(sizeOf({paragraphs}, 30, 4), (Size{50, 72 + 3 + 8}));
}

TEST_F(StyledTextMetricsTest, HeightsAreRoundedOnce) {
    const auto heightOf = [this](double pointSize, const std::string& text) {
        return sizeOf({{.text = text, .pointSize = pointSize}}).height;
    };

    EXPECT_EQ(heightOf(17, "\n\n"), 61.2);
    EXPECT_EQ(heightOf(17, "\n\n\n\n"), 102);
    EXPECT_EQ(heightOf(15.5, "\n\n\n\n"), 93);
    EXPECT_EQ(sizeOf({{.text = "a\n", .pointSize = 17},
                      {.text = "b\n", .pointSize = 12},
                      {.text = "c\nd\n", .pointSize = 17},
                      {.text = "e\n", .pointSize = 15.5},
                      {.text = "f", .pointSize = 11.5}})
                  .height,
              108);
    EXPECT_EQ(sizeOf({{.text = "a b c d e", .pointSize = 17, .lineSpacing = -2}}, 1).height, 94);
    EXPECT_EQ(sizeOf({{.text = "a b c d e f g", .pointSize = 15.5, .lineSpacing = -2}}, 1).height,
              118.2);
    EXPECT_EQ(sizeOf({{.text = "a\nb\nc\nd\ne", .pointSize = 17, .paragraphSpacing = 7.5}}).height,
              132);
}

TEST_F(StyledTextMetricsTest, EveryWholeAndHalfPointSizeIsExactOverFiveLines) {
    for (int halves = 1; halves <= 200; ++halves) {
        const Piece lines{.text = "a\nb\nc\nd\ne", .pointSize = halves / 2.0};

        EXPECT_EQ(sizeOf({lines}).height, 3 * halves);
    }
}

TEST_F(StyledTextMetricsTest, ALongTextIsMeasuredToItsEnd) {
    constexpr std::size_t length = 100'000;
    std::string words;
    while (words.size() < length) {
        words += "a ";
    }

    EXPECT_EQ(sizeOf({{.text = std::string(length, 'a')}}, 100), (Size{length * 10.0, 24}));
    EXPECT_EQ(sizeOf({{.text = std::string(length, ' ')}}, 100), (Size{100, 24}));
    EXPECT_EQ(sizeOf({{.text = words}}, 10), (Size{10, length / 2 * 24.0}));
}

TEST_F(StyledTextMetricsTest, ATextOfManyStretchesIsMeasuredToItsEnd) {
    constexpr int pairs = 50'000;
    MutableAttributedString text;
    for (int pair = 0; pair < pairs; ++pair) {
        text.appendAttributedString(textOf({{.text = "a"}, {.text = "b", .pointSize = 30}}));
    }

    EXPECT_EQ(metrics.sizeOfText(text, 100, 0), (Size{pairs * 25.0, 36}));
}

} // namespace
} // namespace nimbra::host
