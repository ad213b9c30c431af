// Vector statistics, on every variant's entries.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <tuple>
#include <utility>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecStats : public zt::VariantTest {};
using zt::Api;
using zt::Case;

uint32_t bitsOf(float x) { uint32_t u; std::memcpy(&u, &x, 4); return u; }

const float kNaN = std::numeric_limits<float>::quiet_NaN();
const float kInf = std::numeric_limits<float>::infinity();
const float kBig = 9007199254740992.0f;  // 2^53: adding 1 to it is lost in double

}  // namespace

TEST_P(VecStats, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    const float f[4] = {1, 2, 3, 4};
    const int16_t s[4] = {1, 2, 3, 4};
    const double d[4] = {1, 2, 3, 4};
    float of = 42;
    int16_t os = 42;
    double od = 42;
    int32_t oi = 42;
    int idx = 42;
    const std::vector<zt::Watch> w{zt::watch(&of, 4), zt::watch(&os, 2), zt::watch(&od, 8), zt::watch(&oi, 4),
                                   zt::watch(&idx, sizeof idx)};
    const auto checks = [&](auto fn, auto... a) {
        zt::expectChecks(fn, std::make_tuple(a...), w, zt::eachNull(StatusNullPointer, {3}), zt::badLength<1>());
    };
    for (auto fn : {z.zorsSum_32f, z.zorsMean_32f, z.zorsStdDev_32f}) checks(fn, f, 4, &of, 0);
    for (auto fn : {z.zorsMax_32f, z.zorsMin_32f, z.zorsNorm_L2_32f}) checks(fn, f, 4, &of);
    checks(z.zorsMax_16s, s, 4, &os);
    checks(z.zorsMax_64f, d, 4, &od);
    checks(z.zorsNorm_L2_16s32f, s, 4, &of);
    checks(z.zorsNorm_L1_16s32s_Sfs, s, 4, &oi, 0);
    // The index may be null: then only the value is reported.
    checks(z.zorsMaxIndx_16s, s, 4, &os, &idx);
    checks(z.zorsMaxIndx_32f, f, 4, &of, &idx);
    checks(z.zorsMaxIndx_64f, d, 4, &od, &idx);
    const auto twoChecks = [&](auto fn, auto... a) {
        zt::expectChecks(fn, std::make_tuple(a...), w, zt::eachNull(), zt::badLength<2>());
    };
    for (auto fn : {z.zorsNormDiff_L2_32f, z.zorsDotProd_32f}) twoChecks(fn, f, f, 4, &of);
    twoChecks(z.zorsDotProd_16s32s_Sfs, s, s, 4, &oi, 0);
    // The order, and the sample deviation's need of two elements.
    zt::expectChecks(z.zorsStdDev_32f, {f, 4, &of, 0}, w, zt::bad(StatusBadSize, zt::arg<1>(1)),
                     zt::bad(StatusNullPointer, zt::arg<1>(1), zt::arg<2>(nullptr)));
}

// Inputs of mixed magnitude make every order of additions visible.
TEST_P(VecStats, AgreesWithGeneric) {
    const int v = variant();
    zt::agreesWithGeneric(v, [](const Api& z, Case& c) {
        const int n = c.len();
        float* a = c.in<float>(n);
        for (int i = 0; i < n; i += 5) a[i] *= 1e7f;
        const float* b = c.in<float>(n, -1e-3, 1e-3);
        const int16_t* s = c.in<int16_t>(n);
        return z.zorsSum_32f(a, n, c.out<float>(1), 0) + z.zorsMean_32f(a, n, c.out<float>(1), 0) +
               z.zorsStdDev_32f(a, n, c.out<float>(1), 0) + z.zorsDotProd_32f(a, b, n, c.out<float>(1)) +
               z.zorsNorm_L2_32f(a, n, c.out<float>(1)) + z.zorsNormDiff_L2_32f(a, b, n, c.out<float>(1)) +
               z.zorsNorm_L2_16s32f(s, n, c.out<float>(1)) + z.zorsNorm_L1_16s32s_Sfs(s, n, c.out<int32_t>(1), 3) +
               z.zorsDotProd_16s32s_Sfs(s, c.in<int16_t>(n), n, c.out<int32_t>(1), 7);
    });
    // Extrema on few distinct values (ties everywhere) and on specials.
    zt::agreesWithGeneric(v, [](const Api& z, Case& c) {
        const int n = c.len();
        const float* f = c.index() % 2 ? c.in<float>(n, -20, 20) : c.in(c.floats(n));
        const int16_t* s = c.in<int16_t>(n, -20, 20);
        const double* d = c.in<double>(n, -3, 3);
        return z.zorsMax_32f(f, n, c.out<float>(1)) + z.zorsMin_32f(f, n, c.out<float>(1)) +
               z.zorsMaxIndx_32f(f, n, c.out<float>(1), c.out<int>(1)) + z.zorsMax_16s(s, n, c.out<int16_t>(1)) +
               z.zorsMaxIndx_16s(s, n, c.out<int16_t>(1), c.out<int>(1)) + z.zorsMax_64f(d, n, c.out<double>(1)) +
               z.zorsMaxIndx_64f(d, n, c.out<double>(1), c.out<int>(1));
    });
}

// ---- float sums in their fixed order -------------------------------------------------

TEST_P(VecStats, SumsUseTheirFixedPartialSums) {
    const Api& z = this->z();
    float r;
    // Sum and mean: even and odd partial sums, the remainder added last.
    // 2^53 - 2^53 = 0 and 1 + 1 = 2, where left to right gives 1.
    const float v[4] = {kBig, 1.0f, -kBig, 1.0f};
    ASSERT_EQ(z.zorsSum_32f(v, 4, &r, 0), StatusOk);
    EXPECT_EQ(r, 2.0f);
    const float w[5] = {kBig, 0.0f, 0.0f, 0.0f, 1.0f};  // (2^53 + 0) + 1 loses the 1
    ASSERT_EQ(z.zorsSum_32f(w, 5, &r, 12345), StatusOk);
    EXPECT_EQ(r, kBig);
    const float m[4] = {1, 2, 3, 4};
    ASSERT_EQ(z.zorsMean_32f(m, 4, &r, 2), StatusOk);
    EXPECT_EQ(r, 2.5f);
    std::vector<float> tenth(100000, 0.1f);  // in double: a hundred thousand 0.1f rounded once
    ASSERT_EQ(z.zorsMean_32f(tenth.data(), 100000, &r, 0), StatusOk);
    EXPECT_EQ(r, 0.1f);
    // The sample deviation; 0 where n Q - S^2 is not positive.
    ASSERT_EQ(z.zorsStdDev_32f(m, 4, &r, 0), StatusOk);
    EXPECT_EQ(r, static_cast<float>(std::sqrt(5.0 / 3.0)));
    ASSERT_EQ(z.zorsStdDev_32f(tenth.data(), 7, &r, 0), StatusOk);
    EXPECT_EQ(r, 0.0f);

    // Dot product and norms: element i of each block of 32 goes to sum i mod
    // 32 (2^53 and -2^53 at 0 and 32 cancel, the ones at 1 and 33 survive);
    // the sums are combined by halving, 16 apart first (the 1 at 24 is lost
    // in the 2^53 at 8 before the -2^53 at 0 cancels it; a 1 at 8 outlives
    // 2^53 and -2^53 at 0 and 16); the last len mod 32 follow one by one (the
    // 1 at 32 is lost in the 2^53 at 1 that the -2^53 at 33 cancels).
    const auto with = [](int n, std::initializer_list<std::pair<int, float>> set, float fill = 0.0f) {
        std::vector<float> v(n, fill);
        for (auto [i, x] : set) v[i] = x;
        return v;
    };
    const auto dot = [&](const std::vector<float>& x, const std::vector<float>& y, int n) {
        float d = 0;
        EXPECT_EQ(z.zorsDotProd_32f(x.data(), y.data(), n, &d), StatusOk);
        return d;
    };
    const std::vector<float> ones(64, 1.0f);
    EXPECT_EQ(dot(with(64, {{0, kBig}, {1, 1}, {32, -kBig}, {33, 1}}), ones, 64), 2.0f);
    EXPECT_EQ(dot(with(32, {{0, -kBig}, {8, kBig}, {24, 1}}), ones, 32), 0.0f);
    EXPECT_EQ(dot(with(32, {{0, kBig}, {8, 1}, {16, -kBig}}), ones, 32), 1.0f);
    EXPECT_EQ(dot(with(34, {{1, kBig}, {32, 1}, {33, -kBig}}), ones, 34), 0.0f);
    // A NaN result: the input NaN with the largest payload (the first of
    // equals), quieted, whatever NaNs meet in the sums; the default NaN where
    // no input is one (inf * 0, inf - inf).
    const auto nan = [](uint32_t u) { float f; std::memcpy(&f, &u, 4); return f; };
    const auto x = with(70, {{5, kInf}, {10, nan(0x7F800003u)}, {40, nan(0x7FC00001u)}, {67, nan(0x7FC00002u)}}, 1);
    const auto y = with(70, {{5, 0.0f}, {66, nan(0xFFC00002u)}}, 1);
    const auto e = with(8, {{3, nan(0x7FA00000u)}, {5, kInf}}, 1);
    EXPECT_EQ(bitsOf(dot(x, y, 8)), 0xFFC00000u);
    EXPECT_EQ(bitsOf(dot(x, y, 70)), 0xFFC00002u);
    ASSERT_EQ(z.zorsNorm_L2_32f(x.data(), 41, &r), StatusOk);
    EXPECT_EQ(bitsOf(r), 0x7FC00001u);
    ASSERT_EQ(z.zorsNormDiff_L2_32f(x.data(), e.data(), 8, &r), StatusOk);
    EXPECT_EQ(bitsOf(r), 0x7FE00000u);
    // Products in double, exact: (1 + 2^-12)^2 - 1 keeps 2^-24.
    const float p[2] = {1.0f + 0x1p-12f, -1.0f}, q[2] = {1.0f + 0x1p-12f, 1.0f};
    ASSERT_EQ(z.zorsDotProd_32f(p, q, 2, &r), StatusOk);
    EXPECT_EQ(r, 0x1p-11f + 0x1p-24f);
    const float t[3] = {3e30f, 4e30f, 0}, u[3] = {1, 2, -12};  // squares overflow float, not double
    ASSERT_EQ(z.zorsNorm_L2_32f(t, 3, &r), StatusOk);
    EXPECT_EQ(r, static_cast<float>(std::sqrt(double(3e30f) * double(3e30f) + double(4e30f) * double(4e30f))));
    ASSERT_EQ(z.zorsNormDiff_L2_32f(m, u, 3, &r), StatusOk);  // (0, 0, 15)
    EXPECT_EQ(r, 15.0f);
}

// Random data against long double sums: within half a float ulp of the exact
// value, give or take the double accumulation's error (far smaller).
TEST_P(VecStats, DoubleSumsRoundTheExactValue) {
    std::mt19937 rng(11);
    std::uniform_real_distribution<float> u(-4, 4);
    for (int n : {5, 31, 32, 97, 1000, 4133}) {
        std::vector<float> a(n), b(n);
        long double e[3] = {}, size = 0;  // dot product, squares, squared differences
        for (int i = 0; i < n; ++i) a[i] = u(rng), b[i] = u(rng);
        for (int i = 0; i < n; ++i) {  // from memory: x87 registers would keep u(rng) unrounded
            const long double p = (long double)a[i] * b[i], d = (long double)a[i] - b[i];
            e[0] += p, size += std::fabs(p), e[1] += (long double)a[i] * a[i], e[2] += d * d;
        }
        float r[3];
        ASSERT_EQ(z().zorsDotProd_32f(a.data(), b.data(), n, r) + z().zorsNorm_L2_32f(a.data(), n, r + 1) +
                      z().zorsNormDiff_L2_32f(a.data(), b.data(), n, r + 2), StatusOk);
        for (int k = 0; k < 3; ++k) {
            const long double exact = k ? std::sqrt(e[k]) : e[0], m = std::fabs(r[k]);
            const long double halfUlp = 0.5L * (std::nextafter(std::fabs(r[k]), INFINITY) - m);
            EXPECT_LE(std::fabs(r[k] - exact), halfUlp + (k ? e[k] : size) * 0x1p-40L) << n << " " << k;
        }
    }
}

// ---- extrema ------------------------------------------------------------------------

// The first extreme element wins ties (zeros of both signs compare equal);
// NaNs never replace, but a leading NaN stays.
TEST_P(VecStats, ExtremaKeepTheFirstIndex) {
    const Api& z = this->z();
    const int16_t s[5] = {-5, 9, 2, 9, 9};
    int16_t ms;
    int idx;
    ASSERT_EQ(z.zorsMaxIndx_16s(s, 5, &ms, &idx), StatusOk);
    EXPECT_TRUE(ms == 9 && idx == 1);
    ASSERT_EQ(z.zorsMax_16s(s + 2, 3, &ms), StatusOk);
    EXPECT_EQ(ms, 9);
    std::vector<float> zs(37, -1.0f);
    zs[5] = zs[30] = -0.0f;
    zs[20] = 0.0f;
    float m;
    ASSERT_EQ(z.zorsMaxIndx_32f(zs.data(), 37, &m, &idx), StatusOk);
    EXPECT_TRUE(bitsOf(m) == 0x80000000u && idx == 5);
    for (auto& x : zs) x = -x;
    ASSERT_EQ(z.zorsMin_32f(zs.data(), 37, &m), StatusOk);
    EXPECT_EQ(bitsOf(m), 0u);
    zs[3] = zs[36] = kNaN;
    zs[17] = 5.0f;
    ASSERT_EQ(z.zorsMaxIndx_32f(zs.data(), 37, &m, &idx), StatusOk);
    EXPECT_TRUE(m == 5.0f && idx == 17);
    zs[0] = kNaN;
    ASSERT_EQ(z.zorsMaxIndx_32f(zs.data(), 37, &m, &idx), StatusOk);
    EXPECT_TRUE(m != m && idx == 0);
    ASSERT_EQ(z.zorsMin_32f(zs.data(), 37, &m), StatusOk);
    EXPECT_TRUE(m != m);
    std::vector<double> dn(9, -1e300);
    dn[4] = std::numeric_limits<double>::quiet_NaN();
    dn[6] = -7;
    double md;
    ASSERT_EQ(z.zorsMaxIndx_64f(dn.data(), 9, &md, nullptr), StatusOk);  // no index wanted
    EXPECT_EQ(md, -7.0);
}

// ---- integer reductions --------------------------------------------------------------

// Exact 64-bit sums; the L1 norm scales by truncation, the dot product with
// ties to even; both saturate; negative factors shift left.
TEST_P(VecStats, IntegerReductionsAreExact) {
    const Api& z = this->z();
    int32_t r;
    const auto l1 = [&](const std::vector<int16_t>& v, int sf) {
        EXPECT_EQ(z.zorsNorm_L1_16s32s_Sfs(v.data(), int(v.size()), &r, sf), StatusOk);
        return r;
    };
    const auto dot = [&](const std::vector<int16_t>& a, const std::vector<int16_t>& b, int sf) {
        EXPECT_EQ(z.zorsDotProd_16s32s_Sfs(a.data(), b.data(), int(a.size()), &r, sf), StatusOk);
        return r;
    };
    const std::vector<int16_t> v = {-32768, 32767, -1, 0}, three = {3}, one = {1}, minus = {-1};
    EXPECT_EQ(l1(three, 1), 1);
    EXPECT_EQ(l1(v, 0), 65536);
    EXPECT_EQ(l1(v, 17), 0);
    EXPECT_EQ(l1(v, -14), 65536 << 14);
    EXPECT_EQ(l1(v, -15), INT32_MAX);
    EXPECT_EQ(l1(three, -100), INT32_MAX);  // acts as -31
    EXPECT_EQ(l1(one, -40), INT32_MAX);     // 1 << 31 leaves the range
    const std::vector<int16_t> big(200000, -32768), max(200000, 32767);
    const int64_t total = int64_t(200000) * 32768;  // beyond 32 bits; shifts up to 63 count
    EXPECT_EQ(l1(big, 0), INT32_MAX);
    EXPECT_EQ(l1(big, 5), int32_t(total >> 5));
    EXPECT_EQ(l1(big, 32), int32_t(total >> 32));
    EXPECT_EQ(l1(big, 64), 0);

    EXPECT_EQ(dot({1, 2}, {1, 1}, 1), 2);    // 1.5
    EXPECT_EQ(dot({2, 3}, {1, 1}, 1), 2);    // 2.5
    EXPECT_EQ(dot({-1, -2}, {1, 1}, 1), -2);  // -1.5
    const int64_t squares = int64_t(200000) << 30;
    EXPECT_EQ(dot(big, big, 0), INT32_MAX);
    EXPECT_EQ(dot(big, big, 20), int32_t(squares >> 20));
    EXPECT_EQ(dot(big, big, 40), int32_t((squares + (int64_t(1) << 30)) >> 31));  // above 31 acts as 31
    EXPECT_EQ(dot(big, max, 0), INT32_MIN);
    EXPECT_EQ(dot(three, one, -4), 48);
    EXPECT_EQ(dot(three, one, -30), INT32_MAX);
    EXPECT_EQ(dot(minus, one, -99), INT32_MIN);

    std::mt19937 rng(5);
    for (int n : {1, 37, 1003}) {
        std::vector<int16_t> p(n), q(n);
        for (int i = 0; i < n; ++i) p[i] = int16_t(rng()), q[i] = int16_t(rng());
        int64_t s = 0, sq = 0;
        for (int i = 0; i < n; ++i) s += int64_t(p[i]) * q[i], sq += int64_t(p[i]) * p[i];
        for (int sf : {0, 1, 9, 20, 31}) {
            const double e = std::nearbyint(std::ldexp(double(s), -sf));  // ties to even
            EXPECT_EQ(dot(p, q, sf), int32_t(std::clamp(e, -2147483648.0, 2147483647.0))) << n << " " << sf;
        }
        float l2;
        ASSERT_EQ(z.zorsNorm_L2_16s32f(p.data(), n, &l2), StatusOk);
        EXPECT_EQ(l2, static_cast<float>(std::sqrt(static_cast<double>(sq)))) << n;
    }
}

ZT_ALL_VARIANTS(VecStats);
