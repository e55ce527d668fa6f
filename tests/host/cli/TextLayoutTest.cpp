#include "host/cli/TextLayout.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::cli {
namespace {

using Lines = std::vector<std::string>;

TEST(TextLayout, CountsColumns) {
    EXPECT_EQ(displayWidth("abc"), 3U);
    EXPECT_EQ(displayWidth("für"), 3U);
    EXPECT_EQ(displayWidth("fu\u0308r"), 3U);
    EXPECT_EQ(displayWidth("書類"), 4U);
    EXPECT_EQ(displayWidth(""), 0U);
}

TEST(TextLayout, BreaksLinesAtBlanks) {
    EXPECT_EQ(wrapped("one two three", 7), (Lines{"one two", "three"}));
    EXPECT_EQ(wrapped("one two three", 8), (Lines{"one two", "three"}));
    EXPECT_EQ(wrapped("one two three", 80), (Lines{"one two three"}));
    EXPECT_EQ(wrapped("", 80), Lines{});
}

TEST(TextLayout, KeepsItsOwnLineEnds) {
    EXPECT_EQ(wrapped("one\n\ntwo", 80), (Lines{"one", "", "two"}));
}

TEST(TextLayout, LetsALongWordStandAlone) {
    EXPECT_EQ(wrapped("a extraordinarily b", 5), (Lines{"a", "extraordinarily", "b"}));
}

TEST(TextLayout, BreaksTextWithoutBlanksWhereItsLanguageDoes) {
    const Lines lines = wrapped("書類とデータを保存します。", 12);

    std::string joined;
    for (const std::string& line : lines) {
        EXPECT_LE(displayWidth(line), 12U) << line;
        // A full stop never starts a line.
        EXPECT_FALSE(line.starts_with("。"));
        joined += line;
    }
    EXPECT_EQ(joined, "書類とデータを保存します。");
    EXPECT_GE(lines.size(), 3U);
}

TEST(TextLayout, LetsNoControlCharacterThrough) {
    EXPECT_EQ(printable("a\x1b[2Jb\tc\x7f"), "a [2Jb c ");
    EXPECT_EQ(wrapped("a\x1b[2Jb", 80), Lines{"a [2Jb"});
    // The same in other clothes, line ends, and what turns the direction round.
    EXPECT_EQ(printable("\u009b31mä\u009d0;é"), " 31mä 0;é");
    EXPECT_EQ(printable("a\u2028b\u2029c\u0085d"), "a b c d");
    EXPECT_EQ(printable("\u202eabc\u202c"), " abc ");
    // What keeps names of other scripts apart stays.
    EXPECT_EQ(printable("\u2068مكتبة\u2069 日記 📷"), "\u2068مكتبة\u2069 日記 📷");
}

} // namespace
} // namespace nimbra::cli
