// Autocorrelation: exact double sums rounded once, identical on every variant.
#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class AutoCorr : public zt::VariantTest {};

TEST_P(AutoCorr, MatchesDoubleSums) {
    std::mt19937 g(5);
    std::uniform_real_distribution<float> u(-1, 1);
    for (int srcLen : {1, 2, 3, 4, 5, 7, 16, 33, 250}) {
        std::vector<float> x(srcLen);
        for (float& v : x) v = u(g);
        for (int dstLen : {1, 3, srcLen, srcLen + 5}) {
            zt::GuardedBuffer out(dstLen * sizeof(float));
            float* d = out.as<float>();
            ASSERT_EQ(z().zorsAutoCorr_32f(x.data(), srcLen, d, dstLen), StatusOk);
            for (int k = 0; k < dstLen; ++k) {
                volatile double acc = 0;
                for (int n = 0; n + k < srcLen; ++n) acc = acc + double(x[n]) * double(x[n + k]);
                const float want = static_cast<float>(acc);
                EXPECT_EQ(std::memcmp(&d[k], &want, 4), 0) << srcLen << " " << dstLen << " " << k;
            }
        }
    }
}

TEST_P(AutoCorr, Checks) {
    float x[3] = {1, 2, 3}, y[2] = {7, 7};
    EXPECT_EQ(z().zorsAutoCorr_32f(nullptr, 0, y, 2), StatusNullPointer);
    EXPECT_EQ(z().zorsAutoCorr_32f(x, 3, nullptr, 2), StatusNullPointer);
    EXPECT_EQ(z().zorsAutoCorr_32f(x, 0, y, 2), StatusBadSize);
    EXPECT_EQ(z().zorsAutoCorr_32f(x, 3, y, 0), StatusBadSize);
    EXPECT_EQ(y[0], 7.0f);
    ASSERT_EQ(z().zorsAutoCorr_32f(x, 3, y, 2), StatusOk);
    EXPECT_EQ(y[0], 14.0f);
    EXPECT_EQ(y[1], 8.0f);
}

ZT_ALL_VARIANTS(AutoCorr);

}  // namespace
