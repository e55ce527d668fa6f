#include "host/core/FixedViewMetrics.h"

#include <gtest/gtest.h>
#include <limits>
#include <string>

namespace nimbra::host {
namespace {

constexpr double kUnlimited = std::numeric_limits<double>::infinity();
constexpr double kNoNumber = std::numeric_limits<double>::quiet_NaN();

struct FixedViewMetricsTest : testing::Test {
    FixedViewMetrics metrics;
    Font caption = metrics.preferredFontForTextStyle(FontTextStyleCaption1);

    [[nodiscard]] Size sizeOf(const Text& text, double width, int numberOfLines = 0) const {
        return metrics.sizeOfText(AttributedString(text, {.FontAttributeName = caption,
                                                          .ParagraphStyleAttributeName = {}}),
                                  width, numberOfLines);
    }
};

TEST_F(FixedViewMetricsTest, TheFontsAndControlsAreFixed) {
    const Font body = metrics.preferredFontForTextStyle(FontTextStyleBody);

    EXPECT_EQ(body.pointSize, 17);
    EXPECT_EQ(caption.pointSize, 12);
    EXPECT_EQ(metrics.lineHeight(body), 20.4);
    EXPECT_EQ(metrics.lineHeight(caption), 14.4);
    EXPECT_EQ(metrics.progressBarHeight(), 4);
    EXPECT_EQ(metrics.activityIndicatorSize(), (Size{20, 20}));
    EXPECT_EQ(metrics.sizeOfButtonAround({50, 22.5}), (Size{50, 34.5}));
}

TEST_F(FixedViewMetricsTest, EveryCodePointIsHalfAsWideAsTheFontIsLarge) {
    EXPECT_EQ(sizeOf("Mond", kUnlimited), (Size{24, 14.4}));
    EXPECT_EQ(sizeOf("Grüße", kUnlimited), (Size{30, 14.4}));
    EXPECT_EQ(sizeOf("😀", kUnlimited), (Size{6, 14.4}));
}

TEST_F(FixedViewMetricsTest, NoTextTakesNoRoom) {
    EXPECT_EQ(sizeOf(Text(), 100), (Size{}));
    EXPECT_EQ(sizeOf("", 100), (Size{}));
}

TEST_F(FixedViewMetricsTest, ALineEndsAtALineFeed) {
    EXPECT_EQ(sizeOf("one\nthree", kUnlimited), (Size{30, 28.8}));
    EXPECT_EQ(sizeOf("one\n\ntwo", kUnlimited), (Size{18, 43.2}));
}

TEST_F(FixedViewMetricsTest, ALineEndsAtTheLastSpaceThatFitsWhichIsDropped) {
    EXPECT_EQ(sizeOf("one two six", 42), (Size{42, 28.8}));
    EXPECT_EQ(sizeOf("one two six", 41), (Size{18, 43.2}));
    EXPECT_EQ(sizeOf("one two six", 66), (Size{66, 14.4}));
}

TEST_F(FixedViewMetricsTest, AWordThatIsTooLongStandsAlone) {
    EXPECT_EQ(sizeOf("a wonderful day", 24), (Size{54, 43.2}));
    EXPECT_EQ(sizeOf("a wonderful day", 0), (Size{54, 43.2}));
    EXPECT_EQ(sizeOf("a wonderful day", -5), (Size{54, 43.2}));
    EXPECT_EQ(sizeOf("a wonderful day", -kUnlimited), (Size{54, 43.2}));
    EXPECT_EQ(sizeOf("a wonderful day", kNoNumber), (Size{54, 43.2}));
}

TEST_F(FixedViewMetricsTest, BlanksThatPassTheEdgeAreDropped) {
    EXPECT_EQ(sizeOf("    ", kUnlimited), (Size{24, 14.4}));
    EXPECT_EQ(sizeOf("    ", 12), (Size{12, 14.4}));
    EXPECT_EQ(sizeOf("one   two", 18), (Size{18, 28.8}));
}

TEST_F(FixedViewMetricsTest, TheSmallRoundingOfALayoutBreaksNoLine) {
    EXPECT_EQ(sizeOf("one two six", 42 - 1e-6), (Size{42, 28.8}));
    EXPECT_EQ(sizeOf("one two six", 42 - 1e-4), (Size{18, 43.2}));
}

TEST_F(FixedViewMetricsTest, BytesThatBelongToNoCharacterTakeNoRoom) {
    EXPECT_EQ(sizeOf("one \x80", 18), (Size{18, 14.4}));
    EXPECT_EQ(sizeOf("\x80", kUnlimited), (Size{0, 14.4}));
}

TEST_F(FixedViewMetricsTest, LinesBeyondTheNumberAreLeftOut) {
    EXPECT_EQ(sizeOf("one two three", 20, 2), (Size{18, 28.8}));
    EXPECT_EQ(sizeOf("one two three", 20, 5), (Size{30, 43.2}));
    EXPECT_EQ(sizeOf("one two three", 20, -1), (Size{30, 43.2}));
}

TEST_F(FixedViewMetricsTest, ALineFeedAtTheEndBeginsAnotherLine) {
    EXPECT_EQ(sizeOf("one\n", kUnlimited), (Size{18, 28.8}));
    EXPECT_EQ(sizeOf("\n", kUnlimited), (Size{0, 28.8}));
    EXPECT_EQ(sizeOf("\n\none", kUnlimited), (Size{18, 43.2}));
}

} // namespace
} // namespace nimbra::host
