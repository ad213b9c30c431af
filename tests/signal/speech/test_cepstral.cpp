// Cepstral and frame helpers.
#include <gtest/gtest.h>

#include <cmath>
#include <vector>

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Cepstral : public zt::VariantTest {};

// Pointers, then sizes; the last pointer of the scalar-result exports is
// checked before the length (that every export checks its first pointer
// first, the all-zero call of the export suite shows).
TEST_P(Cepstral, Checks) {
    float s[26] = {1, 2, 3}, d[26] = {};
    int16_t x[8] = {1, -1};
    int32_t r = 42, lag = 42;
    void* lifter = nullptr;
    const std::vector<zt::Watch> wd{zt::watch(d, sizeof d)}, wr{zt::watch(&r, sizeof r), zt::watch(&lag, sizeof lag)};
    zt::expectChecks(z().zorsPreemphasize_32f, {d, 3, 0.5f}, wd, zt::eachNull(), zt::badLength<1>());
    zt::expectChecks(z().zorsCopyWithPadding_32f, {s, 3, d, 3}, wd, zt::eachNull(), zt::badLength<1>(), zt::badLength<3>(),
                     zt::bad(StatusBadSize, zt::arg<3>(2)));
    zt::expectChecks(z().zorsNormEnergy_32f, {d, 1, 3, 10.0f, 0.1f}, wd, zt::eachNull(), zt::badLength<1>(),
                     zt::badLength<2>());
    zt::expectChecks(z().zorsSignChangeRate_16s, {x, 8, &r}, wr, zt::eachNull(), zt::badLength<1>(),
                     zt::bad(StatusNullPointer, zt::arg<1>(0), zt::arg<2>(nullptr)));
    zt::expectChecks(z().zorsAutoCorrLagMax_Fwd_16s, {x, 4, 0, 2, &r, &lag}, wr, zt::eachNull(), zt::badLength<1>(),
                     zt::bad(StatusNullPointer, zt::arg<1>(0), zt::arg<5>(nullptr)));
    zt::expectChecks(z().zorsDCTLifterInitAlloc_32f, {&lifter, 26, 13, 22, 1.0f}, {zt::watch(&lifter, sizeof lifter)},
                     zt::eachNull(), zt::badLength<1>(), zt::badLength<2>(), zt::badLength<3>(),
                     zt::bad(StatusBadSize, zt::arg<1>(12)));
    zt::expectChecks(z().zorsDCTLifter_32f, {s, d, lifter}, wd, zt::eachNull());
    EXPECT_EQ(z().zorsDCTLifterFree_32f(lifter), StatusOk);
}

// x[n] - val x[n-1] in double, rounded once, every x[n-1] the original one;
// x[0] kept.  Padding copies and zero-fills up to the destination length.
TEST_P(Cepstral, PreemphasisAndPadding) {
    for (int len : {1, 2, 3, 4, 5, 7, 8, 9, 11, 13, 17, 403}) {
        std::vector<float> v = zt::randomFloats(len, len), x = v;
        ASSERT_TRUE(z().zorsPreemphasize_32f(x.data(), len, 0.95f) == StatusOk && x[0] == v[0]);
        zor::DoublePrecisionScope fpu;
        for (int n = 1; n < len; ++n) ASSERT_EQ(x[n], float(v[n] - double(0.95f) * v[n - 1])) << len << " " << n;
    }
    const float s[3] = {1, 2, 3};
    std::vector<float> d(6, 9.0f), want{1, 2, 3, 0, 0, 9};
    EXPECT_TRUE(z().zorsCopyWithPadding_32f(s, 3, d.data(), 5) == StatusOk && d == want);
}

// Coefficient i = lifter(i) * sum_j cos((j - 1/2) i pi / N) c[j], the
// cosines as floats, the sum in double in increasing j, the lifter
// (1 + (L / 2) sin(i pi / L)) val as a float; nothing written past the last
// coefficient.  The SIMD sums take one to four pairs of coefficients at once
// (an odd count leaves half a pair): counts for each.
TEST_P(Cepstral, DctLifter) {
    const double pi = 3.141592653589793;
    struct { int n, ceps; } const sizes[] = {{26, 13}, {6, 6}, {3, 1}, {40, 19}, {9, 4}};
    for (const auto& sz : sizes) {
        void* d = nullptr;
        ASSERT_EQ(z().zorsDCTLifterInitAlloc_32f(&d, sz.n, sz.ceps, 22, 0.75f), StatusOk);
        std::vector<float> c = zt::randomFloats(sz.n, sz.n, 5.0f), out(sz.ceps + 1, 7.0f);
        ASSERT_EQ(z().zorsDCTLifter_32f(c.data(), out.data(), d), StatusOk);
        EXPECT_TRUE(z().zorsDCTLifterFree_32f(d) == StatusOk && out[sz.ceps] == 7.0f);
        zor::DoublePrecisionScope fpu;
        for (int i = 1; i <= sz.ceps; ++i) {
            volatile double acc = 0, lifter = float((1 + double(11.0f) * std::sin(i * pi / 22)) * 0.75);
            for (int j = 1; j <= sz.n; ++j) acc = acc + double(float(std::cos((j - 0.5) * i * pi / sz.n))) * c[j - 1];
            EXPECT_EQ(out[i - 1], float(acc * lifter)) << sz.n << " " << i;
        }
    }
}

// Energies, strided (the rest untouched): 1 - (max - e) * scale, e first
// raised to the floor max - 0.230259 * silFloor.  Sign changes: zeros are no
// sign; products past 16 bits keep their sign.  The autocorrelation peak: the
// lag of the largest wrapped 32-bit sum (the smaller lag on ties, the first
// lag even when negative), its value doubled with saturation at +-2^30; an
// empty lag range gives lag 0 and INT_MIN.
TEST_P(Cepstral, EnergySignChangesAndAutoCorrelationPeak) {
    float s[7] = {2, -1, 8, -1, 7, -1, -40};
    ASSERT_EQ(z().zorsNormEnergy_32f(s, 2, 4, 10, 0.5f), StatusOk);
    EXPECT_TRUE(s[2] == 1 && s[4] == 0.5f && std::fabs(s[0] + 0.151295f) < 1e-5f && s[6] == s[0]);
    EXPECT_TRUE(s[1] == -1 && s[3] == -1 && s[5] == -1);
    const int16_t x[5] = {1, -1, 0, 1, -1}, big[4] = {-32768, 32767, -256, 256};
    const auto rate = [&](const int16_t* p, int len) {
        int32_t r = -5;
        return z().zorsSignChangeRate_16s(p, len, &r) ? -1 : r;
    };
    EXPECT_TRUE(rate(x, 5) == 2 && rate(x, 1) == 0 && rate(big, 4) == 3);
    const int16_t pulses[16] = {100, 0, 0, 100, 0, 0, 100, 0, 0, 100, 0, 0, 100, 0, 0, 100};
    const int16_t neg[3] = {32767, -32768, 0}, low[3] = {32767, -32768, 32767};
    const std::vector<int16_t> loud(100, 32767);
    struct { const int16_t* x; int len, lo, hi; int32_t max, lag; } const cases[] = {
        {pulses, 8, 2, 6, 2 * 3 * 100 * 100, 3}, {pulses, 8, 5, 4, INT32_MIN, 0}, {neg, 2, 1, 1, 2 * (32767 * -32768), 1},
        {low, 2, 1, 1, INT32_MIN, 1}, {loud.data(), 100, 0, 0, -13107000, 0}};  // 100 * 32767^2 wraps to -6553500
    for (const auto& c : cases) {
        int32_t mx = 0, lag = -1;
        ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(c.x, c.len, c.lo, c.hi, &mx, &lag), StatusOk);
        EXPECT_TRUE(mx == c.max && lag == c.lag) << c.len << " " << c.lo << ": " << mx << " at " << lag;
    }
}

ZT_ALL_VARIANTS(Cepstral);

}  // namespace
