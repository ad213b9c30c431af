// x87 precision control: inside the scope, sums round like IEEE double.
#include <gtest/gtest.h>

#include "frame/fpu.h"

TEST(Fpu, DoublePrecisionScopeRoundsLikeDouble) {
    zor::DoublePrecisionScope scope;
    volatile double a = 1.0, b = 0x1p-60;
    const double r = (a + b) - a;  // 0 in double; 2^-60 in 64-bit mantissas
    EXPECT_EQ(r, 0.0);
    EXPECT_EQ(zor::toFloat(1.0 + 0x1p-30), 1.0f);
    EXPECT_EQ(zor::toFloat(16777217.0), 16777216.0f);  // ties to even at float precision
}
