#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <gtest/gtest.h>

namespace nimbra::test {
namespace {

CommandResult checkWords(const std::string& root) {
    return run({NIMBRA_SOURCE_DIR "/tools/dev/check-words", root});
}

/// What the check says of a tree whose only file, "notes.md", has `line` as its second line.
std::string saidOf(const std::string& line) {
    const ScratchTree tree;
    tree.write("notes.md", "A first line\n" + line + "\nA last line\n");
    const CommandResult result = checkWords(tree.root());
    EXPECT_EQ(result.status, result.output.empty() ? 0 : 1);
    return result.output;
}

TEST(WordCheck, TheProjectHoldsNoneOfThem) {
    const CommandResult result = checkWords(NIMBRA_SOURCE_DIR);

    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.output, "");
}

TEST(WordCheck, APlainLinePasses) {
    EXPECT_EQ(saidOf("The device in run/nimbra/ID.pid, the tool in /usr/bin, PartXXXXXX."), "");
}

// The words are put together here so that this file does not hold them.

TEST(WordCheck, MarksOfUnfinishedWorkAreFound) {
    EXPECT_EQ(saidOf("// TO"
                     "DO: later"),
              "notes.md:2: a mark of unfinished work\n");
    EXPECT_EQ(saidOf("# FIX"
                     "ME"),
              "notes.md:2: a mark of unfinished work\n");
    EXPECT_EQ(saidOf("XX"
                     "X"),
              "notes.md:2: a mark of unfinished work\n");
}

TEST(WordCheck, ReferencesThatNobodyCanFollowAreFound) {
    EXPECT_EQ(saidOf("as Part"
                     " 7.1 has it"),
              "notes.md:2: a reference that a reader cannot follow\n");
}

TEST(WordCheck, PathsOfSomebodysMachineAreFound) {
    EXPECT_EQ(saidOf("see /wo"
                     "rk/main"),
              "notes.md:2: a path of somebody's machine\n");
    EXPECT_EQ(saidOf("\"/ho"
                     "me/me/x\""),
              "notes.md:2: a path of somebody's machine\n");
}

TEST(WordCheck, BlanksAtTheEndOfALineAreFound) {
    EXPECT_EQ(saidOf("words "), "notes.md:2: blanks at the end of the line\n");
}

TEST(WordCheck, TabsAreFound) {
    EXPECT_EQ(saidOf("\twords"), "notes.md:2: a tab\n");
}

} // namespace
} // namespace nimbra::test
