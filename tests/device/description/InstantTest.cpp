#include "device/description/Instant.h"

#include <gtest/gtest.h>

namespace nimbra::device {
namespace {

using namespace std::chrono;

std::optional<std::int64_t> microsecondsOf(const std::string& text) {
    const auto instant = parseInstant(text);
    if (!instant) {
        return std::nullopt;
    }
    return duration_cast<microseconds>(instant->time_since_epoch()).count();
}

TEST(InstantTest, OffsetsAndFractionsAreCounted) {
    constexpr std::int64_t second = 1'000'000;
    EXPECT_EQ(microsecondsOf("1970-01-01T00:00:00Z"), 0);
    EXPECT_EQ(microsecondsOf("2024-03-05T14:07:09Z"), 1709647629 * second);
    EXPECT_EQ(microsecondsOf("2024-03-05t14:07:09z"), 1709647629 * second);
    EXPECT_EQ(microsecondsOf("2024-03-05T15:07:09+01:00"), 1709647629 * second);
    EXPECT_EQ(microsecondsOf("2024-03-05T08:37:09-05:30"), 1709647629 * second);
    EXPECT_EQ(microsecondsOf("1970-01-01T00:00:00.5Z"), second / 2);
    EXPECT_EQ(microsecondsOf("1970-01-01T00:00:00.123456789Z"), 123456);
    EXPECT_EQ(microsecondsOf("1970-01-01T00:00:00.1234567890123Z"), 123456);
    EXPECT_EQ(microsecondsOf("1969-12-31T23:59:60Z"), 0);
    EXPECT_EQ(microsecondsOf("0001-01-01T00:00:00Z"), -62135596800 * second);
    EXPECT_EQ(microsecondsOf("9999-12-31T23:59:59Z"), 253402300799 * second);
    EXPECT_EQ(microsecondsOf("2024-02-29T00:00:00Z"), 1709164800 * second);
}

TEST(InstantTest, AnyOtherTextIsNoInstant) {
    for (const char* const text : {"",
                                   "2024-03-05",
                                   "2024-03-05 14:07:09Z",
                                   "2024-03-05T14:07:09",
                                   "2023-02-29T00:00:00Z",
                                   "2024-13-01T00:00:00Z",
                                   "2024-00-01T00:00:00Z",
                                   "2024-01-01T24:00:00Z",
                                   "2024-01-01T00:60:00Z",
                                   "2024-01-01T00:00:61Z",
                                   "2024-01-01T00:00:00+24:00",
                                   "2024-01-01T00:00:00+01:60",
                                   "2024-01-01T00:00:00+0100",
                                   "2024-01-01T00:00:00.Z",
                                   "24-01-01T00:00:00Z",
                                   "2024-01-01T00:00:00Zulu",
                                   "2024-01-01T00:00:00+1:00",
                                   "2024-01-01T0:00:00Z",
                                   "2024-01-01T00:00:00Z ",
                                   "+024-01-01T00:00:00Z",
                                   "2024-01-01T00:00:00+01:0"}) {
        EXPECT_EQ(parseInstant(text), std::nullopt) << text;
    }
}

} // namespace
} // namespace nimbra::device
