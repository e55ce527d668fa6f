#include "device/apps/ProcessRecord.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

TEST(ProcessRecord, HoldsANumberAndAStartTime) {
    const ProcessRecord expected{.process = 4711, .startTime = 123456789012};

    EXPECT_EQ(ProcessRecord::parse("4711 123456789012\n"), expected);
    EXPECT_EQ(ProcessRecord::parse("4711 123456789012"), expected);
    EXPECT_EQ(ProcessRecord::parse(expected.text()), expected);
}

TEST(ProcessRecord, MayLackTheStartTime) {
    const ProcessRecord expected{.process = 4711, .startTime = std::nullopt};

    EXPECT_EQ(ProcessRecord::parse("4711\n"), expected);
    EXPECT_EQ(ProcessRecord::parse("4711"), expected);
    EXPECT_EQ(ProcessRecord::parse(expected.text()), expected);
}

TEST(ProcessRecord, IsNothingElse) {
    for (const char* const content :
         {"", "\n", " ", "notes", "-4711", "+4711", "4711x", " 4711", "4711 ", "4711  5", "4711 -5",
          "4711 x", "4711 5 6", "4711\t5", "4711\n5", "2147483648", "99999999999999999999",
          "4711 99999999999999999999", "0x10"}) {
        EXPECT_FALSE(ProcessRecord::parse(content)) << content;
    }
}

} // namespace
} // namespace nimbra::device
