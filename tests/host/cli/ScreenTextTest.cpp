#include "host/cli/ScreenText.h"

#include "host/core/Presentations.h"
#include "host/core/ScreenDescription.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::cli {
namespace {

using host::ScreenDescription;
using host::ViewDescription;

const Terminal plain{.width = 30, .isStyled = false};
const Terminal styled{.width = 30, .isStyled = true};

ViewDescription label(const Text& text) {
    return {.name = {}, .className = "Label", .text = text};
}

ViewDescription button(const Text& title, bool enabled) {
    return {.name = {}, .className = "Button", .enabled = enabled, .text = title};
}

ViewDescription styledLabel(const AttributedString& text) {
    ViewDescription view = label(Text(text.string()));
    view.styledText = text;
    return view;
}

MutableAttributedString boldText(const Text& text) {
    return {text, {.FontAttributeName = Font::boldSystemFontOfSize(17)}};
}

TEST(ScreenText, ShowsTitleTextsAndButtonsFromTopToBottom) {
    const ScreenDescription screen{
        .title = "Drive", .views = {label("One text"), label("Another one"), button("Go", true)}};

    EXPECT_EQ(screenText(screen, plain), "Drive\n"
                                         "\n"
                                         "  One text\n"
                                         "\n"
                                         "  Another one\n"
                                         "\n"
                                         "  [Go]\n");
}

TEST(ScreenText, ShowsNothingOfWhatCannotBeSeen) {
    ViewDescription transparent = label("transparent");
    transparent.alpha = 0;
    ViewDescription hidden = label("hidden");
    hidden.hidden = true;
    const ScreenDescription screen{.title = "Drive",
                                   .views = {transparent, hidden, label(Text()), label("")}};

    EXPECT_EQ(screenText(screen, plain), "Drive\n");
}

TEST(ScreenText, PutsAsterisksAroundWhatIsBoldWhereThereAreNoStyles) {
    MutableAttributedString text = boldText("Note\n");
    text.appendAttributedString({"Not on ", {}});
    text.appendAttributedString(boldText("Phone"));
    text.appendAttributedString({" and ", {}});
    text.appendAttributedString(boldText(" Tab "));
    text.appendAttributedString({".", {}});

    EXPECT_EQ(screenText({.title = "Drive", .views = {styledLabel(text)}}, plain),
              "Drive\n"
              "\n"
              "  *Note*\n"
              "  Not on *Phone* and\n"
              "  *Tab* .\n");
}

TEST(ScreenText, MarksEachLineOfStackedNames) {
    EXPECT_EQ(screenText({.title = "Drive", .views = {styledLabel(boldText("A\n\nB"))}}, plain),
              "Drive\n"
              "\n"
              "  *A*\n"
              "  \n"
              "  *B*\n");
}

TEST(ScreenText, MakesBoldWhatIsBoldAlsoAcrossABreak) {
    MutableAttributedString text({"It is called ", {}});
    text.appendAttributedString(boldText("Grandmother's Old Computer"));
    text.appendAttributedString({" here", {}});

    EXPECT_EQ(screenText({.title = "Drive", .views = {styledLabel(text)}}, styled),
              "\x1b[1mDrive\x1b[0m\n"
              "\n"
              "  It is called \x1b[1mGrandmother's\x1b[0m\n"
              "  \x1b[1mOld Computer\x1b[0m here\n");
}

TEST(ScreenText, LetsNoNameMoveTheCursorOrFeignAMark) {
    const auto text = boldText("a\x1b[2Jb\uFFF9c\uFFFBd");

    EXPECT_EQ(screenText({.title = "x\x07y", .views = {styledLabel(text)}}, styled),
              "\x1b[1mx y\x1b[0m\n"
              "\n"
              "  \x1b[1ma [2Jbcd\x1b[0m\n");
}

TEST(AlertText, ShowsTitleAndMessage) {
    const host::ShownAlert alert{.title = "Sure?", .message = "There is no way back from here."};

    EXPECT_EQ(alertText(alert, plain), "\n"
                                       "Sure?\n"
                                       "  There is no way back from\n"
                                       "  here.\n");
}

} // namespace
} // namespace nimbra::cli
