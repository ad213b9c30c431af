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
}

TEST(ScaleRound, NegativeScaleShiftsLeftAndSaturates) {
    EXPECT_EQ(scaleRound(3, -2), 12);
    EXPECT_EQ(scaleRound(-3, -2), -12);
    EXPECT_EQ(saturate<uint8_t>(scaleRound(1, -8)), 255);
    EXPECT_EQ(saturate<uint8_t>(scaleRound(0, -40)), 0);
    EXPECT_EQ(saturate<int16_t>(scaleRound(-1, -40)), -32768);
    EXPECT_EQ(scaleRound(int64_t(1) << 40, -30), std::numeric_limits<int64_t>::max());
}

TEST(ScaleRound, HalfUpRule) {
    EXPECT_EQ(scaleRoundHalfUp(5, 1), 3);
    EXPECT_EQ(scaleRoundHalfUp(7, 1), 4);
    EXPECT_EQ(scaleRoundHalfUp(-5, 1), -2);  // -2.5 rounds up to -2
    EXPECT_EQ(scaleRoundHalfUp(9, 2), 2);
    EXPECT_EQ(scaleRoundHalfUp(10, 2), 3);
}

TEST(Saturate, ClampsToTheDestination) {
    EXPECT_EQ(saturate<uint8_t>(-1), 0);
    EXPECT_EQ(saturate<uint8_t>(256), 255);
    EXPECT_EQ(saturate<uint8_t>(200), 200);
    EXPECT_EQ(saturate<int16_t>(40000), 32767);
    EXPECT_EQ(saturate<int16_t>(-40000), -32768);
    EXPECT_EQ(saturate<uint16_t>(int64_t(-5)), 0);
    EXPECT_EQ(saturate<int32_t>(int64_t(1) << 40), INT32_MAX);
    EXPECT_EQ(saturate<int8_t>(uint32_t(200)), 127);
    EXPECT_EQ(saturate<uint32_t>(int64_t(-1)), 0u);
}

TEST(RoundEven, TiesGoToEven) {
    EXPECT_EQ(roundEven(0.5), 0.0);
    EXPECT_EQ(roundEven(1.5), 2.0);
    EXPECT_EQ(roundEven(2.5), 2.0);
    EXPECT_EQ(roundEven(-2.5), -2.0);
    EXPECT_EQ(roundEven(-3.5), -4.0);
    EXPECT_EQ(roundEven(2.4999999999999996), 2.0);
    EXPECT_EQ(roundEven(1e300), 1e300);
    EXPECT_TRUE(std::signbit(roundEven(-0.4)));
}

TEST(SaturateRound, NanInfinityAndRange) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    EXPECT_EQ(saturateRound<int16_t>(nan), -32768);
    EXPECT_EQ(saturateRound<int32_t>(nan), INT32_MIN);
    EXPECT_EQ(saturateRound<uint8_t>(nan), 0);
    EXPECT_EQ(saturateRound<int16_t>(1e9), 32767);
    EXPECT_EQ(saturateRound<int16_t>(-INFINITY), -32768);
    EXPECT_EQ(saturateRound<uint8_t>(254.5), 254);
    EXPECT_EQ(saturateRound<uint8_t>(255.5), 255);
    EXPECT_EQ(saturateRound<uint8_t>(-0.5), 0);
    EXPECT_EQ(saturateRound<int32_t>(2147483647.4), INT32_MAX);
    EXPECT_EQ(saturateRound<int32_t>(-2147483648.6), INT32_MIN);
}
