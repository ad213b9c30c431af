// Cepstral and frame helpers.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstring>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Cepstral : public zt::VariantTest {};

TEST_P(Cepstral, Checks) {
    const zt::Api& a = z();
    float s[26] = {1, 2, 3}, d[26] = {};
    int16_t x[8] = {1, -1};
    int32_t r = 42;
    int lag = 42;
    void* lifter = nullptr;
    const std::vector<zt::Watch> wd{zt::watch(d, sizeof d)}, wr{zt::watch(&r, sizeof r), zt::watch(&lag, sizeof lag)};
    zt::expectChecks(a.zorsPreemphasize_32f, {d, 3, 0.5f}, wd, zt::eachNull(), zt::badLength<1>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)));
    zt::expectChecks(a.zorsCopyWithPadding_32f, {s, 3, d, 3}, wd, zt::eachNull(), zt::badLength<1>(), zt::badLength<3>(),
                     zt::bad(StatusBadSize, zt::arg<3>(2)), zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)));
    zt::expectChecks(a.zorsNormEnergy_32f, {d, 1, 3, 10.0f, 0.1f}, wd, zt::eachNull(), zt::badLength<1>(),
                     zt::badLength<2>(), zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)));
    zt::expectChecks(a.zorsSignChangeRate_16s, {x, 8, &r}, wr, zt::eachNull(), zt::badLength<1>(),
                     zt::bad(StatusNullPointer, zt::arg<1>(0), zt::arg<2>(nullptr)));
    zt::expectChecks(a.zorsAutoCorrLagMax_Fwd_16s, {x, 4, 0, 2, &r, &lag}, wr, zt::eachNull(), zt::badLength<1>(),
                     zt::bad(StatusNullPointer, zt::arg<1>(0), zt::arg<5>(nullptr)));
    zt::expectChecks(a.zorsDCTLifterInitAlloc_32f, {&lifter, 26, 13, 22, 1.0f}, {zt::watch(&lifter, sizeof lifter)}, zt::eachNull(),
                     zt::badLength<1>(), zt::badLength<2>(), zt::badLength<3>(), zt::bad(StatusBadSize, zt::arg<1>(12)),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)));
    zt::expectChecks(a.zorsDCTLifter_32f, {s, d, lifter}, wd, zt::eachNull());
    EXPECT_EQ(a.zorsDCTLifterFree_32f(lifter), StatusOk);
    EXPECT_EQ(a.zorsDCTLifterFree_32f(nullptr), StatusNullPointer);
}

// x[n] - val x[n-1] in double, rounded once, every x[n-1] the original one;
// x[0] kept.  Padding copies and zero-fills.
TEST_P(Cepstral, PreemphasisAndPadding) {
    for (int len : {1, 2, 3, 4, 5, 7, 8, 9, 11, 13, 17, 403}) {
        const std::vector<float> v = zt::randomFloats(len, len);
        std::vector<float> x = v;
        ASSERT_EQ(z().zorsPreemphasize_32f(x.data(), len, 0.95f), StatusOk);
        for (int n = 0; n < len; ++n) {
            volatile double p = double(0.95f) * v[n - (n > 0)], d = double(v[n]) - p;
            ASSERT_EQ(x[n], n == 0 ? v[0] : static_cast<float>(d)) << len << " " << n;
        }
    }
    const float s[3] = {1, 2, 3}, want[6] = {1, 2, 3, 0, 0, 9};
    float d[6] = {9, 9, 9, 9, 9, 9};
    ASSERT_TRUE(z().zorsCopyWithPadding_32f(s, 3, d, 3) == StatusOk && d[3] == 9.0f);
    ASSERT_EQ(z().zorsCopyWithPadding_32f(s, 3, d, 5), StatusOk);
    EXPECT_EQ(std::memcmp(d, want, sizeof want), 0);
}

// Coefficient i = lifter(i) * sum_j cos((j - 1/2) i pi / N) c[j], the
// cosines as floats, the sum in double in increasing j, the lifter
// (1 + (L / 2) sin(i pi / L)) val as a float.
TEST_P(Cepstral, DctLifter) {
    const zt::Api& a = z();
    void* d = nullptr;
    ASSERT_EQ(a.zorsDCTLifterInitAlloc_32f(&d, 26, 13, 22, 0.75f), StatusOk);
    std::vector<float> c = zt::randomFloats(26, 1, 5.0f), out(13);
    ASSERT_EQ(a.zorsDCTLifter_32f(c.data(), out.data(), d), StatusOk);
    for (int i = 1; i <= 13; ++i) {
        volatile double acc = 0, lifter = float((1 + double(11.0f) * std::sin(i * 3.141592653589793 / 22)) * 0.75);
        for (int j = 1; j <= 26; ++j) acc = acc + double(float(std::cos((j - 0.5) * i * 3.141592653589793 / 26))) * c[j - 1];
        EXPECT_EQ(out[i - 1], float(acc * lifter)) << i;
    }
    EXPECT_EQ(a.zorsDCTLifterFree_32f(d), StatusOk);
    // The SIMD sums run several coefficients side by side: the generic bits.
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        void* lifter = nullptr;
        const int ceps = 1 + c.index(), n = ceps + c.len() % 13;
        if (z.zorsDCTLifterInitAlloc_32f(&lifter, n, ceps, 22, 0.75f)) return -1;
        const Status s = z.zorsDCTLifter_32f(c.in<float>(n), c.out<float>(ceps + 1), lifter);
        return s + z.zorsDCTLifterFree_32f(lifter);
    });
}

// Energies: 1 - (max - e) * scale, with e first raised to the floor max -
// 0.230259 * silFloor; strided, the rest untouched.
TEST_P(Cepstral, NormEnergyAndSignChanges) {
    float e[3] = {10, 9, 0};
    ASSERT_EQ(z().zorsNormEnergy_32f(e, 1, 3, 10, 0.1f), StatusOk);
    EXPECT_TRUE(e[0] == 1.0f && std::fabs(e[1] - 0.9f) < 1e-6f && std::fabs(e[2] - 0.769741f) < 1e-6f);
    float s[7] = {2, -1, 8, -1, 5, -1, -40};
    ASSERT_EQ(z().zorsNormEnergy_32f(s, 2, 4, 10, 0.5f), StatusOk);
    EXPECT_TRUE(s[2] == 1.0f && std::fabs(s[0] - (1.0f - 2.30259f * 0.5f)) < 1e-5f && s[4] == s[0] && s[6] == s[0]);
    EXPECT_TRUE(s[1] == -1.0f && s[5] == -1.0f);
    const int16_t x[5] = {1, -1, 0, 1, -1}, big[2] = {-32768, 32767};
    int32_t r = -5;
    struct { const int16_t* p; int len, want; } const cases[] = {{x, 5, 2}, {x, 1, 0}, {big, 2, 1}};
    for (const auto& c : cases)  // zeros are no sign; -32768 * 32767 does not overflow
        EXPECT_TRUE(z().zorsSignChangeRate_16s(c.p, c.len, &r) == StatusOk && r == c.want) << c.len;
}

// The lag of the largest wrapped 32-bit sum (the smaller lag on ties), its
// value doubled with saturation; an empty lag range gives lag 0 and INT_MIN.
TEST_P(Cepstral, AutoCorrLagMax) {
    std::vector<int16_t> x(64);
    for (int i = 0; i < 64; ++i) x[i] = (i % 4 == 0) ? 100 : 0;
    int32_t mx = 0;
    int lag = -1;
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 32, 2, 10, &mx, &lag), StatusOk);
    EXPECT_TRUE(lag == 4 && mx == 2 * 8 * 100 * 100);
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 32, 5, 4, &mx, &lag), StatusOk);
    EXPECT_TRUE(lag == 0 && mx == INT32_MIN);
    std::vector<int16_t> loud(200, 32767);
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(loud.data(), 100, 0, 0, &mx, &lag), StatusOk);
    const int32_t wrapped = static_cast<int32_t>(100u * uint32_t(32767 * 32767));
    EXPECT_EQ(mx, wrapped >= (1 << 30) ? INT32_MAX : wrapped < -(1 << 30) ? INT32_MIN : 2 * wrapped);
    const int16_t neg[3] = {32767, -32768, 0}, low[3] = {32767, -32768, 32767};
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(neg, 2, 1, 1, &mx, &lag), StatusOk);
    EXPECT_EQ(mx, 2 * (32767 * -32768));
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(low, 2, 1, 1, &mx, &lag), StatusOk);
    EXPECT_EQ(mx, INT32_MIN);  // r = -2 * 32767 * 32768: below -2^30
}

ZT_ALL_VARIANTS(Cepstral);

}  // namespace
