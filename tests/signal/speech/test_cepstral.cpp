// Cepstral and frame helpers.
#include <gtest/gtest.h>

#include <climits>
#include <cmath>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

constexpr double kPi = 3.141592653589793;

class Cepstral : public zt::VariantTest {};

TEST_P(Cepstral, Preemphasis) {
    float x[3] = {1, 1, 1};
    ASSERT_EQ(z().zorsPreemphasize_32f(x, 3, 0.97f), StatusOk);
    EXPECT_EQ(x[0], 1.0f);
    EXPECT_NEAR(x[1], 0.03f, 1e-7f);  // 1 - 0.97f: the float val is a hair above 0.97
    EXPECT_NEAR(x[2], 0.03f, 1e-7f);
    // every length, against the double definition, identical on every variant
    std::mt19937 g(3);
    std::uniform_real_distribution<float> u(-1000, 1000);
    for (int len : {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 17, 400, 403}) {
        std::vector<float> v(len);
        for (float& f : v) f = u(g);
        zt::GuardedBuffer buf(len * 4);
        std::memcpy(buf.data(), v.data(), len * 4);
        ASSERT_EQ(z().zorsPreemphasize_32f(buf.as<float>(), len, 0.95f), StatusOk);
        for (int n = 0; n < len; ++n) {
            volatile double p = double(0.95f) * v[n - (n > 0)];
            volatile double d = double(v[n]) - p;
            const float want = n == 0 ? v[0] : static_cast<float>(d);
            EXPECT_EQ(buf.as<float>()[n], want) << len << " " << n;
        }
    }
    EXPECT_EQ(z().zorsPreemphasize_32f(nullptr, 0, 1), StatusNullPointer);
    EXPECT_EQ(z().zorsPreemphasize_32f(x, 0, 1), StatusBadSize);
}

TEST_P(Cepstral, CopyWithPadding) {
    float s[3] = {1, 2, 3}, d[5] = {9, 9, 9, 9, 9};
    EXPECT_EQ(z().zorsCopyWithPadding_32f(s, 3, d, 2), StatusBadSize);
    EXPECT_EQ(z().zorsCopyWithPadding_32f(nullptr, 0, d, 2), StatusNullPointer);
    EXPECT_EQ(z().zorsCopyWithPadding_32f(s, 0, d, 2), StatusBadSize);
    EXPECT_EQ(d[0], 9.0f);
    ASSERT_EQ(z().zorsCopyWithPadding_32f(s, 3, d, 3), StatusOk);
    EXPECT_EQ(d[2], 3.0f);
    EXPECT_EQ(d[3], 9.0f);
    ASSERT_EQ(z().zorsCopyWithPadding_32f(s, 3, d, 5), StatusOk);
    const float want[5] = {1, 2, 3, 0, 0};
    EXPECT_EQ(std::memcmp(d, want, sizeof want), 0);
}

TEST_P(Cepstral, DctLifter) {
    const auto& a = z();
    void* d = nullptr;
    EXPECT_EQ(a.zorsDCTLifterInitAlloc_32f(nullptr, 26, 13, 22, 1), StatusNullPointer);
    EXPECT_EQ(a.zorsDCTLifterInitAlloc_32f(&d, 12, 13, 22, 1), StatusBadSize);
    EXPECT_EQ(a.zorsDCTLifterInitAlloc_32f(&d, 26, 0, 22, 1), StatusBadSize);
    EXPECT_EQ(a.zorsDCTLifterInitAlloc_32f(&d, 26, 13, 0, 1), StatusBadSize);
    EXPECT_EQ(d, nullptr);
    ASSERT_EQ(a.zorsDCTLifterInitAlloc_32f(&d, 26, 13, 22, 1.0f), StatusOk);
    // a constant input has no cepstrum beyond c0
    std::vector<float> c(26, 3.5f), out(13, 9.0f);
    ASSERT_EQ(a.zorsDCTLifter_32f(c.data(), out.data(), d), StatusOk);
    for (float v : out) EXPECT_NEAR(v, 0.0f, 1e-4f);  // float cosines times 3.5 times the lifter
    // random input against the definition
    std::mt19937 g(1);
    std::uniform_real_distribution<float> u(-5, 5);
    for (float& v : c) v = u(g);
    ASSERT_EQ(a.zorsDCTLifter_32f(c.data(), out.data(), d), StatusOk);
    for (int i = 1; i <= 13; ++i) {
        double acc = 0;
        for (int j = 1; j <= 26; ++j) acc += double(float(std::cos((j - 0.5) * i * kPi / 26))) * c[j - 1];
        const double lifter = 1 + double(11.0f) * std::sin(i * kPi / 22);
        EXPECT_NEAR(out[i - 1], acc * double(float(lifter)), 1e-5 * (1 + std::fabs(acc * lifter))) << i;
    }
    // the SIMD sums run several coefficients side by side: same bits as the generic code
    for (int ceps : {1, 2, 5, 8, 9, 13, 20}) {
        void* mine = nullptr;
        void* generic = nullptr;
        ASSERT_EQ(a.zorsDCTLifterInitAlloc_32f(&mine, 26, ceps, 22, 0.75f), StatusOk);
        ASSERT_EQ(zt::api(0).zorsDCTLifterInitAlloc_32f(&generic, 26, ceps, 22, 0.75f), StatusOk);
        std::vector<float> x(26), y(ceps), w(ceps);
        for (float& v : x) v = u(g);
        ASSERT_EQ(a.zorsDCTLifter_32f(x.data(), y.data(), mine), StatusOk);
        ASSERT_EQ(zt::api(0).zorsDCTLifter_32f(x.data(), w.data(), generic), StatusOk);
        EXPECT_EQ(std::memcmp(y.data(), w.data(), ceps * 4), 0) << ceps;
        EXPECT_EQ(a.zorsDCTLifterFree_32f(mine), StatusOk);
        EXPECT_EQ(zt::api(0).zorsDCTLifterFree_32f(generic), StatusOk);
    }
    EXPECT_EQ(a.zorsDCTLifter_32f(nullptr, out.data(), d), StatusNullPointer);
    EXPECT_EQ(a.zorsDCTLifter_32f(c.data(), out.data(), nullptr), StatusNullPointer);
    // val scales every coefficient through the lifter
    void* d2 = nullptr;
    ASSERT_EQ(a.zorsDCTLifterInitAlloc_32f(&d2, 26, 13, 22, 2.0f), StatusOk);
    std::vector<float> out2(13);
    ASSERT_EQ(a.zorsDCTLifter_32f(c.data(), out2.data(), d2), StatusOk);
    for (int i = 0; i < 13; ++i) EXPECT_FLOAT_EQ(out2[i], 2 * out[i]);
    EXPECT_EQ(a.zorsDCTLifterFree_32f(d2), StatusOk);
    EXPECT_EQ(a.zorsDCTLifterFree_32f(d), StatusOk);
    EXPECT_EQ(a.zorsDCTLifterFree_32f(nullptr), StatusNullPointer);
}

TEST_P(Cepstral, NormEnergy) {
    float e[3] = {10, 9, 0};
    ASSERT_EQ(z().zorsNormEnergy_32f(e, 1, 3, 10, 0.1f), StatusOk);
    EXPECT_FLOAT_EQ(e[0], 1.0f);
    EXPECT_FLOAT_EQ(e[1], 0.9f);
    EXPECT_NEAR(e[2], 0.769741f, 1e-6f);
    // strided, untouched in between
    float s[7] = {2, -1, 8, -1, 5, -1, -40};
    ASSERT_EQ(z().zorsNormEnergy_32f(s, 2, 4, 10, 0.5f), StatusOk);
    EXPECT_FLOAT_EQ(s[2], 1.0f);
    // 2, 5 and -40 lie below the floor 8 - 2.30259: all clamped to it
    EXPECT_NEAR(s[0], 1.0f - 2.30259f * 0.5f, 1e-5f);
    EXPECT_EQ(s[4], s[0]);
    EXPECT_EQ(s[6], s[0]);
    EXPECT_EQ(s[1], -1.0f);
    EXPECT_EQ(s[5], -1.0f);
    EXPECT_EQ(z().zorsNormEnergy_32f(nullptr, 1, 1, 1, 1), StatusNullPointer);
    EXPECT_EQ(z().zorsNormEnergy_32f(e, 0, 1, 1, 1), StatusBadSize);
    EXPECT_EQ(z().zorsNormEnergy_32f(e, 1, 0, 1, 1), StatusBadSize);
}

TEST_P(Cepstral, SignChangeRate) {
    const int16_t x[5] = {1, -1, 0, 1, -1};
    int32_t r = -5;
    ASSERT_EQ(z().zorsSignChangeRate_16s(x, 5, &r), StatusOk);
    EXPECT_EQ(r, 2);
    ASSERT_EQ(z().zorsSignChangeRate_16s(x, 1, &r), StatusOk);
    EXPECT_EQ(r, 0);
    const int16_t big[2] = {-32768, 32767};
    ASSERT_EQ(z().zorsSignChangeRate_16s(big, 2, &r), StatusOk);
    EXPECT_EQ(r, 1);
    EXPECT_EQ(z().zorsSignChangeRate_16s(nullptr, 0, &r), StatusNullPointer);
    EXPECT_EQ(z().zorsSignChangeRate_16s(x, 5, nullptr), StatusNullPointer);
    EXPECT_EQ(z().zorsSignChangeRate_16s(x, 0, &r), StatusBadSize);
}

TEST_P(Cepstral, AutoCorrLagMax) {
    // period 4: lags 4 and 8 give the same peak, the smaller wins
    std::vector<int16_t> x(64);
    for (int i = 0; i < 64; ++i) x[i] = (i % 4 == 0) ? 100 : 0;
    int32_t mx = 0;
    int lag = -1;
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 32, 2, 10, &mx, &lag), StatusOk);
    EXPECT_EQ(lag, 4);
    EXPECT_EQ(mx, 2 * 8 * 100 * 100);
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 32, 5, 4, &mx, &lag), StatusOk);
    EXPECT_EQ(lag, 0);
    EXPECT_EQ(mx, INT32_MIN);
    // saturation of 2 r, and the wrapping 32-bit sum
    std::vector<int16_t> loud(200, 32767);
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(loud.data(), 100, 0, 0, &mx, &lag), StatusOk);
    uint32_t r = 0;
    for (int i = 0; i < 100; ++i) r += uint32_t(32767 * 32767);
    const int32_t rs = static_cast<int32_t>(r);
    EXPECT_EQ(mx, rs >= (1 << 30) ? INT32_MAX : rs < -(1 << 30) ? INT32_MIN : 2 * rs);
    std::vector<int16_t> neg(4, 0);
    neg[0] = 32767;
    neg[1] = -32768;
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(neg.data(), 2, 1, 1, &mx, &lag), StatusOk);
    EXPECT_EQ(mx, 2 * (32767 * -32768));
    const int16_t low[3] = {32767, -32768, 32767};
    ASSERT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(low, 2, 1, 1, &mx, &lag), StatusOk);
    EXPECT_EQ(mx, INT32_MIN);  // r = -2 * 32767 * 32768: below -2^30
    EXPECT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(nullptr, 0, 0, 0, &mx, &lag), StatusNullPointer);
    EXPECT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 4, 0, 0, nullptr, &lag), StatusNullPointer);
    EXPECT_EQ(z().zorsAutoCorrLagMax_Fwd_16s(x.data(), 0, 0, 0, &mx, &lag), StatusBadSize);
}

ZT_ALL_VARIANTS(Cepstral);

}  // namespace
