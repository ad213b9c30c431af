// Autocorrelation: double sums rounded once (few lags: exactly; many lags:
// to float rounding), identical on every variant.
#include <gtest/gtest.h>

#include <cmath>
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

// Long signals with many lags go through the spectrum: within float rounding
// of the double sums (plus a sliver of lag 0 for the small lags), the same on
// every variant, and nothing written past dstLen.
TEST_P(AutoCorr, ManyLagsAgreeWithDoubleSums) {
    std::mt19937 g(9);
    std::uniform_real_distribution<float> u(-1, 1);
    const struct { int srcLen, dstLen; } cases[] = {{256, 256}, {1000, 600}, {3001, 5000}, {4096, 4096}};
    for (const auto& c : cases) {
        std::vector<float> x(c.srcLen);
        for (float& v : x) v = u(g) + 0.25f;  // a mean, so lag 0 dominates
        zt::GuardedBuffer out(c.dstLen * sizeof(float)), ref(c.dstLen * sizeof(float));
        ASSERT_EQ(z().zorsAutoCorr_32f(x.data(), c.srcLen, out.as<float>(), c.dstLen), StatusOk);
        ASSERT_EQ(zt::api(0).zorsAutoCorr_32f(x.data(), c.srcLen, ref.as<float>(), c.dstLen), StatusOk);
        EXPECT_EQ(std::memcmp(out.as<float>(), ref.as<float>(), c.dstLen * sizeof(float)), 0);
        double lag0 = 0;
        for (float v : x) lag0 += double(v) * v;
        for (int k = 0; k < c.dstLen; ++k) {
            double acc = 0;
            for (int n = 0; n + k < c.srcLen; ++n) acc += double(x[n]) * double(x[n + k]);
            const float want = static_cast<float>(acc), got = out.as<float>()[k];
            const double tol = std::ldexp(std::fabs(double(want)), -23) + 1e-13 * lag0;
            ASSERT_LE(std::fabs(double(got) - want), tol) << c.srcLen << " " << k;
            if (k >= c.srcLen) {
                ASSERT_EQ(got, 0.0f);
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
