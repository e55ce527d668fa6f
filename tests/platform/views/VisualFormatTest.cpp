#include "platform/views/LayoutConstraint.h"
#include "platform/views/View.h"
#include "tests/device/TestFiles.h"
#include "tests/fuzz/VisualFormatChecks.h"
#include "tests/support/TestPlatform.h"

#include <array>
#include <filesystem>
#include <gtest/gtest.h>
#include <limits>
#include <sstream>

namespace nimbra {
namespace {

struct VisualFormatTest : testing::Test {
    test::TestPlatform platform;
    std::shared_ptr<View> root = newView();
    std::shared_ptr<View> a = newView();
    std::shared_ptr<View> b = newView();
    std::shared_ptr<View> elsewhere = newView();
    LayoutConstraint::Format format{
        .metrics = {{"margin", 50}, {"overlap", -3}, {"low", 250}, {"tiny_2", 0.5}},
        .views = {
            {"a", a.get()}, {"_b", b.get()}, {"elsewhere", elsewhere.get()}, {"no", nullptr}}};

    void SetUp() override {
        root->addSubview(a);
        root->addSubview(b);
    }
    [[nodiscard]] std::shared_ptr<View> newView() {
        return std::make_shared<View>(platform.services(), Rect{});
    }

    [[nodiscard]] std::string nameOf(const View* view) const {
        if (view == root.get()) {
            return "|";
        }
        return view == a.get() ? "a" : view == b.get() ? "b" : "?";
    }
    [[nodiscard]] static std::string nameOf(LayoutAttribute attribute) {
        constexpr std::array names{"left", "right", "top", "bottom", "width", "height", ""};
        return names.at(static_cast<std::size_t>(attribute));
    }
    /// The constraints of a format, one after the other: "a.left == |.left + 20 @1000; …".
    [[nodiscard]] std::string rulesOf(std::string_view text) const {
        const auto constraints = LayoutConstraint::constraintsWithVisualFormat(text, format);
        if (!constraints) {
            return constraints.error().line();
        }
        std::ostringstream rules;
        for (const LayoutConstraint& rule : *constraints) {
            constexpr std::array signs{"<=", "==", ">="};
            rules << (rules.view().empty() ? "" : "; ") << nameOf(rule.firstItem) << '.'
                  << nameOf(rule.firstAttribute) << ' '
                  << signs.at(static_cast<std::size_t>(rule.relation)) << ' ';
            if (rule.secondItem != nullptr) {
                rules << nameOf(rule.secondItem) << '.' << nameOf(rule.secondAttribute) << " + ";
            }
            rules << rule.constant;
            if (rule.priority != requiredLayoutPriority) {
                rules << " @" << rule.priority;
            }
        }
        return rules.str();
    }
    void expectMistake(std::string_view text, int column, const std::string& expected) const {
        SCOPED_TRACE(text);
        const auto constraints = LayoutConstraint::constraintsWithVisualFormat(text, format);
        ASSERT_FALSE(constraints);
        EXPECT_EQ(constraints.error(),
                  (Error{"LayoutConstraint", column,
                         "column " + std::to_string(column) + ": " + expected + " was expected"}));
    }
};

TEST_F(VisualFormatTest, AFormatRunsAcrossUnlessItSaysDown) {
    EXPECT_EQ(rulesOf("|[a]"), "a.left == |.left + 0");
    EXPECT_EQ(rulesOf("H:|[a]"), "a.left == |.left + 0");
    EXPECT_EQ(rulesOf("V:|[a]"), "a.top == |.top + 0");
}

TEST_F(VisualFormatTest, AViewAloneSaysNothing) {
    EXPECT_EQ(rulesOf("[a]"), "");
}

TEST_F(VisualFormatTest, ABareHyphenIsTheStandardDistance) {
    EXPECT_EQ(rulesOf("|-[a]-[_b]-|"),
              "a.left == |.left + 20; b.left == a.right + 8; |.right == b.right + 20");
    EXPECT_EQ(rulesOf("V:|-[a]-[_b]-|"),
              "a.top == |.top + 20; b.top == a.bottom + 8; |.bottom == b.bottom + 20");
}

TEST_F(VisualFormatTest, DistancesAreNumbersOrMetrics) {
    EXPECT_EQ(rulesOf("|-7-[a]-2.5-[_b]-0-|"),
              "a.left == |.left + 7; b.left == a.right + 2.5; |.right == b.right + 0");
    EXPECT_EQ(rulesOf("|-margin-[a]-(tiny_2)-[_b]"),
              "a.left == |.left + 50; b.left == a.right + 0.5");
}

TEST_F(VisualFormatTest, DistancesInParenthesesMayBeNegative) {
    EXPECT_EQ(rulesOf("[a]-(-4)-[_b]"), "b.left == a.right + -4");
    EXPECT_EQ(rulesOf("[a]-(>=overlap)-[_b]"), "b.left >= a.right + -3");
}

TEST_F(VisualFormatTest, PredicatesHaveRelationsAndPriorities) {
    EXPECT_EQ(rulesOf("|-(>=5,<=9@750,==7@low)-[a]"),
              "a.left >= |.left + 5; a.left <= |.left + 9 @750; a.left == |.left + 7 @250");
    EXPECT_EQ(rulesOf("V:[a(10,>=margin@0.5)]"), "a.height == 10; a.height >= 50 @0.5");
}

TEST_F(VisualFormatTest, AnExtentCanBeThatOfAView) {
    EXPECT_EQ(rulesOf("[a(_b)][_b(>=a@low)]"),
              "a.width == b.width + 0; b.width >= a.width + 0 @250; b.left == a.right + 0");
}

TEST_F(VisualFormatTest, WhatIsMissingIsNamedWithItsColumn) {
    expectMistake("", 1, "a view or the superview's edge");
    expectMistake("H:", 3, "a view or the superview's edge");
    expectMistake("h:[a]", 1, "a view or the superview's edge");
    expectMistake("|", 2, "a view");
    expectMistake("H:|-|", 5, "a view");
    expectMistake("[]", 2, "a view's name");
    expectMistake("[2]", 2, "a view's name");
    expectMistake("[a", 3, "a closing bracket");
    expectMistake("[a ]", 3, "a closing bracket");
    expectMistake("[a]-", 5, "a distance, a view or the superview's edge");
    expectMistake("[a]-5", 6, "a hyphen");
    expectMistake("[a]-5-", 7, "a view or the superview's edge");
    expectMistake("[a]-(5)[_b]", 8, "a hyphen");
    expectMistake("[a]--5-[_b]", 5, "a distance, a view or the superview's edge");
}

TEST_F(VisualFormatTest, WhatFollowsTheFormatIsAMistake) {
    expectMistake("[a]x", 4, "a distance, a view, the superview's edge or the end");
    expectMistake("|[a]|x", 6, "the end");
    expectMistake("|[a]|[_b]", 6, "the end");
    expectMistake(std::string_view("[a]\0", 4), 4,
                  "a distance, a view, the superview's edge or the end");
}

TEST_F(VisualFormatTest, MistakesInPredicatesAreNamedWithTheirColumn) {
    expectMistake("[a()]", 4, "a number or the name of a metric or a view");
    expectMistake("[a(=5)]", 4, "a number or the name of a metric or a view");
    expectMistake("[a(5,)]", 6, "a number or the name of a metric or a view");
    expectMistake("[a(5", 5, "a comma or a closing parenthesis");
    expectMistake("[a(-5)]", 4, "a number or the name of a metric or a view");
    expectMistake("[a(overlap)]", 4, "an extent that is not negative");
    expectMistake("|-()-[a]", 4, "a number or a metric's name");
    expectMistake("|-(-overlap)-[a]", 5, "a number");
    expectMistake("|-(5.)-[a]", 6, "a digit");
    expectMistake("[a(5@)]", 6, "a priority");
    expectMistake("[a(5@1001)]", 6, "a priority from 0 to 1000");
    expectMistake("[a(5@overlap)]", 6, "a priority from 0 to 1000");
}

TEST_F(VisualFormatTest, UnknownNamesAreMistakes) {
    expectMistake("H:|[foot]|", 5, "the name of a view");
    expectMistake("[a(foot)]", 4, "the name of a metric or a view");
    expectMistake("[a]-foot-[_b]", 5, "the name of a metric");
    expectMistake("[a]-(_b)-[_b]", 6, "the name of a metric");
    expectMistake("[a(5@foot)]", 6, "the name of a metric");
    expectMistake("[no]", 2, "the name of a view that is not null");
}

TEST_F(VisualFormatTest, NumbersAreThoseOfAScreen) {
    format.metrics["nan"] = std::numeric_limits<double>::quiet_NaN();
    format.metrics["infinite"] = std::numeric_limits<double>::infinity();
    format.metrics["huge"] = -1000001;

    EXPECT_EQ(rulesOf("[a(1000000)]"), "a.width == 1e+06");
    expectMistake("[a(1000000.5)]", 4, "a number up to 1000000");
    expectMistake("[a(" + std::string(400, '9') + ")]", 4, "a number up to 1000000");
    expectMistake("[a(nan)]", 4, "a metric from -1000000 to 1000000");
    expectMistake("|-(infinite)-[a]", 4, "a metric from -1000000 to 1000000");
    expectMistake("|-huge-[a]", 3, "a metric from -1000000 to 1000000");
    expectMistake("[a(5@nan)]", 6, "a metric from -1000000 to 1000000");
}

TEST_F(VisualFormatTest, OptionsAreRefused) {
    format.options = 1;
    expectMistake("[a]", 1, "no format option");
}

TEST_F(VisualFormatTest, AllViewsStandInOneSuperview) {
    expectMistake("[a]-[elsewhere]", 6, "a view of the same superview");
    expectMistake("[a(elsewhere)]", 4, "a view of the same superview");
    EXPECT_EQ(rulesOf("[elsewhere(5)]"), "?.width == 5");
    expectMistake("H:|[elsewhere]", 3, "views that have a superview");
    expectMistake("[elsewhere]-|", 13, "views that have a superview");
}

TEST_F(VisualFormatTest, TheFilesOfTheFuzzerAreReadAsTheirNamesSay) {
    int good = 0;
    int bad = 0;
    const auto corpus = std::filesystem::path(NIMBRA_CORPUS) / "visual-format";
    for (const auto& [name, content] : test::treeOf(corpus)) {
        SCOPED_TRACE(name);
        const bool isGood = name.starts_with("good-");
        EXPECT_TRUE(isGood || name.starts_with("bad-"));
        ++(isGood ? good : bad);
        EXPECT_EQ(test::isVisualFormat(content), isGood);
        EXPECT_EQ(test::faultInVisualFormat(content), "");
    }
    EXPECT_GT(good, 0);
    EXPECT_GT(bad, 0);
}

} // namespace
} // namespace nimbra
