#include "device/files/PercentEncoding.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

TEST(PercentEncodingTest, AnIdentifierStaysReadable) {
    EXPECT_EQ(percentEncoded("com.example.Notes-2_b"), "com.example.Notes-2_b");
}

TEST(PercentEncodingTest, WhateverTheTextItBecomesOneFileName) {
    EXPECT_EQ(percentEncoded("../a/b"), "%2E.%2Fa%2Fb");
    EXPECT_EQ(percentEncoded("."), "%2E");
    EXPECT_EQ(percentEncoded("ä %"), "%C3%A4%20%25");
}

TEST(PercentEncodingTest, KeptCharactersStayAsTheyAre) {
    EXPECT_EQ(percentEncoded("/a b/c?d", "/"), "/a%20b/c%3Fd");
}

} // namespace
} // namespace nimbra::device
