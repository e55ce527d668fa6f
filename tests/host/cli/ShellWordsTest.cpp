#include "host/cli/ShellWords.h"

#include <gtest/gtest.h>
#include <string>
#include <vector>

namespace nimbra::cli {
namespace {

using Words = std::vector<std::string>;

TEST(ShellWords, PartsALineAtItsBlanks) {
    EXPECT_EQ(ShellWords::split("  set\tNotes  on ").words, (Words{"set", "Notes", "on"}));
    EXPECT_TRUE(ShellWords::split(" ").words.empty());
}

TEST(ShellWords, TakesBlanksIntoAWordInQuotationMarks) {
    EXPECT_EQ(ShellWords::split(R"("a b" 'c "d' e\ f x"y z")").words,
              (Words{"a b", "c \"d", "e f", "xy z"}));
    EXPECT_EQ(ShellWords::split(R"("" 'a\b' "\"")").words, (Words{"", "a\\b", "\""}));
}

TEST(ShellWords, SaysThatAQuotationMarkHasNoPartner) {
    EXPECT_FALSE(ShellWords::split(R"(get "No)").isClosed);
    EXPECT_EQ(ShellWords::split(R"(get "No t)").words, (Words{"get", "No t"}));
    EXPECT_TRUE(ShellWords::split(R"(get "No")").isClosed);
}

TEST(ShellWords, SaysWhereTheLastWordStarts) {
    EXPECT_EQ(ShellWords::split("get No").lastStart, 4U);
    EXPECT_EQ(ShellWords::split("get \"No t").lastStart, 4U);
    EXPECT_EQ(ShellWords::split("get ").lastStart, 4U);
    EXPECT_EQ(ShellWords::split("").lastStart, 0U);
}

TEST(ShellWords, QuotesAWordSoThatItComesBackTheSame) {
    for (const std::string word : {"plain", "two words", "a\"b", "a\\b", "it's", ""}) {
        EXPECT_EQ(ShellWords::split(quotedWord(word)).words, Words{word});
    }
    EXPECT_EQ(quotedWord("plain"), "plain");
}

} // namespace
} // namespace nimbra::cli
