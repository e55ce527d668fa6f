#include "host/cli/StatusText.h"

#include "host/cli/TextLayout.h"

#include <gtest/gtest.h>
#include <string>

namespace nimbra::cli {
namespace {

host::FooterDescription idle(Text text) {
    return {.text = std::move(text)};
}

host::FooterDescription syncing(float progress, Text text) {
    return {.syncing = true, .barHidden = false, .barProgress = progress, .text = std::move(text)};
}

TEST(StatusText, IsTheSentenceOfTheLastSync) {
    EXPECT_EQ(statusText(idle("Last synced just now.")), "Last synced just now.");
    EXPECT_EQ(statusLine(idle("Last synced just now."), 80), "Last synced just now.");
}

TEST(StatusText, IsEmptyWhereThereIsNothingToSay) {
    EXPECT_EQ(statusText(idle("    ")), "");
    EXPECT_EQ(statusText(idle("")), "");
    EXPECT_EQ(statusText(idle(Text())), "");
}

TEST(StatusText, SaysHowFarTheSyncHasCome) {
    EXPECT_EQ(statusText(syncing(0.456F, "Uploading")), "45 %  Uploading");
    EXPECT_EQ(statusText(syncing(0, Text())), "0 %");
    EXPECT_EQ(statusText(syncing(1, "Done")), "100 %  Done");
    EXPECT_EQ(statusText(syncing(0.9999F, "Nearly")), "99 %  Nearly");
    EXPECT_EQ(statusText(syncing(0.999999F, "Nearly")), "99 %  Nearly");
}

TEST(StatusText, EachHundredthIsItsPercentage) {
    for (int percent = 0; percent <= 100; ++percent) {
        const auto progress = static_cast<float>(percent / 100.0);
        EXPECT_EQ(statusText(syncing(progress, "")), std::to_string(percent) + " %");
    }
}

TEST(StatusText, ALineHasADrawnBar) {
    EXPECT_EQ(statusLine(syncing(0.5F, "Uploading"), 80), "[##########----------] 50 %  Uploading");
    EXPECT_EQ(statusLine(syncing(1, "Done"), 80), "[####################] 100 %  Done");
    EXPECT_EQ(statusLine(syncing(0, ""), 80), "[--------------------] 0 %");
}

TEST(StatusText, ALineIsCutBetweenCharacters) {
    EXPECT_EQ(statusLine(idle("Uploading"), 9), "Uploading");
    EXPECT_EQ(statusLine(idle("Uploading"), 8), "Uploadi…");
    const std::string wide = statusLine(idle("書類をアップロード中"), 8);
    EXPECT_EQ(wide, "書類を…");
    EXPECT_LE(displayWidth(wide), 8U);
}

TEST(StatusText, WhatCouldMoveTheCursorIsBlank) {
    EXPECT_EQ(statusLine(idle("a\nb\x1b[2Jc"), 80), "a b [2Jc");
}

} // namespace
} // namespace nimbra::cli
