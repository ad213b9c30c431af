// The shared rounding and saturation helpers.
#include <gtest/gtest.h>

#include <cmath>
#include <limits>

#include "frame/status.h"

using namespace zor;

namespace {
// r / 2^s rounded to nearest, ties to even, by exact integer reasoning.
int64_t referenceRound(int64_t r, int s) {
    const int64_t d = int64_t(1) << s;
    int64_t q = r / d, m = r % d;  // truncating
    if (m < 0) { m += d; q -= 1; }  // floor division
    if (2 * m > d || (2 * m == d && (q & 1))) ++q;
    return q;
}
}  // namespace

TEST(ScaleRound, MatchesExactRounding) {
    for (int s = 1; s <= 20; ++s)
        for (int64_t r = -70000; r <= 70000; r += 7) ASSERT_EQ(scaleRound(r, s), referenceRound(r, s)) << r << " >> " << s;
    // Wide values keep exactness near the top of the 32-bit range.
    for (int s = 1; s <= 31; ++s)
        for (int64_t r : {int64_t(INT32_MAX), int64_t(INT32_MIN), int64_t(INT32_MAX) * 65535})
            EXPECT_EQ(scaleRound(r, s), referenceRound(r, s)) << r << " >> " << s;
    // Half up: -2.5 rounds to -2, 2.25 to 2, 2.5 to 3.
    EXPECT_TRUE(scaleRoundHalfUp(5, 1) == 3 && scaleRoundHalfUp(-5, 1) == -2 && scaleRoundHalfUp(9, 2) == 2 &&
                scaleRoundHalfUp(10, 2) == 3);
}

// A negative scale shifts left, saturating so that the destination clamps.
TEST(Saturate, ClampsToTheDestination) {
    EXPECT_TRUE(scaleRound(3, -2) == 12 && scaleRound(-3, -2) == -12);
    EXPECT_EQ(saturate<uint8_t>(scaleRound(1, -8)), 255);
    EXPECT_EQ(saturate<int16_t>(scaleRound(-1, -40)), -32768);
    EXPECT_EQ(scaleRound(int64_t(1) << 40, -30), std::numeric_limits<int64_t>::max());
    EXPECT_TRUE(saturate<uint8_t>(-1) == 0 && saturate<uint8_t>(256) == 255 && saturate<uint8_t>(255) == 255);
    EXPECT_TRUE(saturate<int16_t>(40000) == 32767 && saturate<int16_t>(-32769) == -32768);
    EXPECT_EQ(saturate<int32_t>(int64_t(1) << 40), INT32_MAX);
    EXPECT_EQ(saturate<int8_t>(uint32_t(200)), 127);
    EXPECT_EQ(saturate<uint32_t>(int64_t(-1)), 0u);
}

TEST(RoundEven, TiesGoToEven) {
    for (int k = -20; k <= 20; ++k) EXPECT_EQ(roundEven(k + 0.5), 2 * std::round((k + 0.5) / 2)) << k;
    EXPECT_EQ(roundEven(2.4999999999999996), 2.0);  // no double rounding through a wider register
    EXPECT_EQ(roundEven(1e300), 1e300);
    EXPECT_TRUE(std::signbit(roundEven(-0.4)));
}

TEST(SaturateRound, NanInfinityAndRange) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    EXPECT_TRUE(saturateRound<int16_t>(nan) == -32768 && saturateRound<int32_t>(nan) == INT32_MIN);
    EXPECT_EQ(saturateRound<uint8_t>(nan), 0);
    EXPECT_TRUE(saturateRound<int16_t>(1e9) == 32767 && saturateRound<int16_t>(-INFINITY) == -32768);
    EXPECT_TRUE(saturateRound<uint8_t>(254.5) == 254 && saturateRound<uint8_t>(255.5) == 255);
    EXPECT_EQ(saturateRound<uint8_t>(-0.5), 0);
    EXPECT_EQ(saturateRound<int32_t>(2147483647.4), INT32_MAX);
    EXPECT_EQ(saturateRound<int32_t>(-2147483648.6), INT32_MIN);
}
