#include "tests/house/Command.h"
#include "tests/house/ScratchTree.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sstream>

namespace nimbra::test {
namespace {

using testing::HasSubstr;

/// The last line of the table in `output`, with one blank between its columns.
std::string sumIn(const std::string& output) {
    std::istringstream words(output.substr(output.rfind("\nall ") + 1));
    std::string line;
    std::string sum;
    std::getline(words, line);
    words = std::istringstream(line);
    for (std::string word; words >> word;) {
        sum += (sum.empty() ? "" : " ") + word;
    }
    return sum;
}

/// A tree of one source and a program that tests it.
class Mutations : public testing::Test {
protected:
    void SetUp() override {
        tree.write("CMakeLists.txt",
                   "cmake_minimum_required(VERSION 3.25)\n"
                   "project(scratch LANGUAGES CXX)\n"
                   "set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/bin)\n"
                   "add_executable(text-tests support/Less.cpp tests/Test.cpp)\n");
        tree.write("support/Less.h", "#pragma once\nbool isLess(int left, int right);\n");
        tree.write("support/Less.cpp", "#include \"support/Less.h\"\n"
                                       "static_assert(true);\n"
                                       "bool isLess(int left, int right) {\n"
                                       "    return left < right;\n"
                                       "}\n");
    }

    /// Has the tree's test ask for `condition`.
    void writeTest(const std::string& condition) const {
        tree.write("tests/Test.cpp", "#include \"support/Less.h\"\n\nint main() {\n    return " +
                                         condition + " ? 0 : 1;\n}\n");
    }

    /// Has the change of `<` that goes unnoticed, and perhaps the other one, among the exceptions.
    void writeExceptions(const std::string& more = "") const {
        tree.write("tools/dev/mutate-exceptions", "# What nobody asks for.\n\n"
                                                  "support/Less.cpp\n"
                                                  "Two of one size are no matter here.\n"
                                                  "return left < right;\n"
                                                  "`<` becomes `<=`\n" +
                                                      more);
    }

    [[nodiscard]] CommandResult mutate(const std::vector<std::string>& what = {}) const {
        std::vector<std::string> words{NIMBRA_SOURCE_DIR "/tools/dev/mutate", "--root",
                                       tree.root()};
        words.insert(words.end(), what.begin(), what.end());
        return run(words);
    }

    ScratchTree tree;
};

TEST_F(Mutations, AreMadeInConditionsValuesNamesAndStatements) {
    tree.write("support/Less.cpp", R"(#define NUMBER 1
/* 2 + 2 */
class Base {
    virtual int number() = 0;
};
constexpr std::array<int, 3> numbers{-2};

std::string Derived::text(const Base& base, bool on = true) {
    std::string line(base.text());
    if (const auto more = base.more()) {
        line += *more; // 5
    }
    base.setFirst(on);
    base.setSecond(line);
    for (const auto& each : base.all()) {
        base.tell([this](int count) -> std::string {
            first(Kind::one);
            second(Kind::two);
            return count > 0 && !on ? "a" : line;
        });
    }
    each([](int count) { return count; });
    return line;
}
)");

    EXPECT_EQ(mutate({"--list"}).output, R"(support/Less.cpp:6: `3` becomes `(3 + 1)`
support/Less.cpp:6: `-` left out
support/Less.cpp:6: `2` becomes `(2 + 1)`
support/Less.cpp:8: `true` becomes `false`
support/Less.cpp:10: condition is false
support/Less.cpp:10: condition is true
support/Less.cpp:10: exchanged with the next statement
support/Less.cpp:11: `+=` becomes `=`
support/Less.cpp:11: statement left out
support/Less.cpp:13: statement left out
support/Less.cpp:14: statement left out
support/Less.cpp:14: exchanged with the next statement
support/Less.cpp:15: exchanged with the next statement
support/Less.cpp:16: statement left out
support/Less.cpp:17: `one` becomes `two`
support/Less.cpp:17: statement left out
support/Less.cpp:17: exchanged with the next statement
support/Less.cpp:18: `two` becomes `one`
support/Less.cpp:18: statement left out
support/Less.cpp:19: `>` becomes `>=`
support/Less.cpp:19: `>` becomes `<`
support/Less.cpp:19: `0` becomes `(0 + 1)`
support/Less.cpp:19: `&&` becomes `||`
support/Less.cpp:19: `!` left out
support/Less.cpp:19: condition before `?` is true
support/Less.cpp:19: condition before `?` is false
support/Less.cpp:19: `"a"` becomes `"~a"`
support/Less.cpp:19: nothing returned
support/Less.cpp:22: statement left out
support/Less.cpp:23: nothing returned
)");
}

TEST_F(Mutations, PassWhereTheTestsNoticeEach) {
    writeTest("isLess(1, 2) && !isLess(2, 1) && !isLess(1, 1)");

    const CommandResult result = mutate();

    EXPECT_EQ(result.status, 0) << result.output;
    EXPECT_EQ(sumIn(result.output), "all 4 3 0 0 1 100.0 %") << "one does not compile";
}

TEST_F(Mutations, FailWhereOneSurvives) {
    writeTest("isLess(1, 2) && !isLess(2, 1)");

    const CommandResult result = mutate({"support/Less.cpp:4"});

    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output,
                HasSubstr("support/Less.cpp:4: `<` becomes `<=`: return left < right;"));
    EXPECT_EQ(sumIn(result.output), "all 3 2 1 0 0 66.6 %");
}

TEST_F(Mutations, FailWhereTooManyOfAllAreExcepted) {
    writeTest("isLess(1, 2) && !isLess(2, 1)");
    writeExceptions();

    const CommandResult all = mutate();
    const CommandResult one = mutate({"support/Less.cpp"});

    EXPECT_EQ(all.status, 1);
    EXPECT_EQ(sumIn(all.output), "all 4 2 0 1 1 66.6 %");
    EXPECT_EQ(one.status, 0) << "a single source may have many";
    EXPECT_EQ(sumIn(one.output), sumIn(all.output));
}

TEST_F(Mutations, FailWhereAnExceptionIsOfNoUse) {
    writeTest("isLess(1, 2) && !isLess(2, 1)");
    writeExceptions("return left < right;\n`<` becomes `>`\n");

    const CommandResult result = mutate({"support/Less.cpp"});

    EXPECT_EQ(result.status, 1);
    EXPECT_THAT(result.output, HasSubstr("an exception of no use: support/Less.cpp: `<` becomes "
                                         "`>`: return left < right;"));
}

} // namespace
} // namespace nimbra::test
