// Vector statistics, on every variant's entries.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class VecStats : public zt::VariantTest {};
class VecExtrema : public zt::VariantTest {};
class VecIntStats : public zt::VariantTest {};

using Api = zt::Api;

uint32_t bitsOf(float x) { uint32_t u; std::memcpy(&u, &x, 4); return u; }

const float kNaN = std::numeric_limits<float>::quiet_NaN();
const float kInf = std::numeric_limits<float>::infinity();

// A copy of v flush against a guard page (after or before the data).
template <class T>
struct GuardedCopy {
    zt::GuardedBuffer buf;
    GuardedCopy(const std::vector<T>& v, zt::Guard where)
        : buf(sizeof(T) * std::max<size_t>(v.size(), 1), where) {
        std::memcpy(buf.data(), v.data(), v.size() * sizeof(T));
    }
    const T* p() const { return buf.as<T>(); }
};

std::vector<float> randomFloats(int n, uint32_t seed, float scale = 1000.0f) {
    std::mt19937 rng(seed);
    std::uniform_real_distribution<float> u(-scale, scale);
    std::vector<float> v(n);
    for (auto& x : v) x = u(rng);
    return v;
}
std::vector<int16_t> randomShorts(int n, uint32_t seed) {
    std::mt19937 rng(seed);
    std::uniform_int_distribution<int> u(-32768, 32767);
    std::vector<int16_t> v(n);
    for (auto& x : v) x = static_cast<int16_t>(u(rng));
    return v;
}

const int kLengths[] = {1, 2, 3, 4, 5, 7, 8, 9, 15, 16, 17, 31, 33, 64, 101, 1003, 4099};

}  // namespace

// ---- argument checks ------------------------------------------------------------------

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
    // (source null?, length) -> status, for every member.
    using F = std::function<Status(bool, int)>;
    const std::pair<const char*, F> cases[] = {
        {"Sum", [&](bool nul, int n) { return z.zorsSum_32f(nul ? nullptr : f, n, &of, 0); }},
        {"Mean", [&](bool nul, int n) { return z.zorsMean_32f(nul ? nullptr : f, n, &of, 0); }},
        {"StdDev", [&](bool nul, int n) { return z.zorsStdDev_32f(nul ? nullptr : f, n, &of, 0); }},
        {"Max16", [&](bool nul, int n) { return z.zorsMax_16s(nul ? nullptr : s, n, &os); }},
        {"Max32", [&](bool nul, int n) { return z.zorsMax_32f(nul ? nullptr : f, n, &of); }},
        {"Max64", [&](bool nul, int n) { return z.zorsMax_64f(nul ? nullptr : d, n, &od); }},
        {"Min32", [&](bool nul, int n) { return z.zorsMin_32f(nul ? nullptr : f, n, &of); }},
        {"MaxIndx16", [&](bool nul, int n) { return z.zorsMaxIndx_16s(nul ? nullptr : s, n, &os, &idx); }},
        {"MaxIndx32", [&](bool nul, int n) { return z.zorsMaxIndx_32f(nul ? nullptr : f, n, &of, &idx); }},
        {"MaxIndx64", [&](bool nul, int n) { return z.zorsMaxIndx_64f(nul ? nullptr : d, n, &od, &idx); }},
        {"NormL2", [&](bool nul, int n) { return z.zorsNorm_L2_32f(nul ? nullptr : f, n, &of); }},
        {"NormL2_16s", [&](bool nul, int n) { return z.zorsNorm_L2_16s32f(nul ? nullptr : s, n, &of); }},
        {"NormDiff", [&](bool nul, int n) { return z.zorsNormDiff_L2_32f(f, nul ? nullptr : f, n, &of); }},
        {"NormL1", [&](bool nul, int n) { return z.zorsNorm_L1_16s32s_Sfs(nul ? nullptr : s, n, &oi, 0); }},
        {"Dot", [&](bool nul, int n) { return z.zorsDotProd_32f(f, nul ? nullptr : f, n, &of); }},
        {"Dot16", [&](bool nul, int n) { return z.zorsDotProd_16s32s_Sfs(nul ? nullptr : s, s, n, &oi, 0); }},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.first);
        EXPECT_EQ(c.second(true, 0), StatusNullPointer);
        EXPECT_EQ(c.second(true, 4), StatusNullPointer);
        EXPECT_EQ(c.second(false, 0), StatusBadSize);
        EXPECT_EQ(c.second(false, -1), StatusBadSize);
    }
    EXPECT_EQ(z.zorsStdDev_32f(f, 1, &of, 0), StatusBadSize);
    EXPECT_EQ(z.zorsStdDev_32f(f, 1, nullptr, 0), StatusNullPointer);
    EXPECT_EQ(z.zorsSum_32f(f, 4, nullptr, 0), StatusNullPointer);
    EXPECT_EQ(z.zorsMaxIndx_32f(f, 4, nullptr, &idx), StatusNullPointer);
    EXPECT_EQ(z.zorsDotProd_16s32s_Sfs(s, s, 4, nullptr, 0), StatusNullPointer);
    EXPECT_EQ(of, 42.0f);
    EXPECT_EQ(os, 42);
    EXPECT_EQ(od, 42.0);
    EXPECT_EQ(oi, 42);
    EXPECT_EQ(idx, 42);
}

// ---- float sums in their fixed order -------------------------------------------------

TEST_P(VecStats, SumAndMeanUseEvenAndOddPartialSums) {
    const Api& z = this->z();
    const float big = 9007199254740992.0f;  // 2^53: adding 1 to it is lost in double
    // Even sum: 2^53 - 2^53 = 0; odd sum: 1 + 1 = 2.  Left to right would give 1.
    const float v[4] = {big, 1.0f, -big, 1.0f};
    float r;
    ASSERT_EQ(z.zorsSum_32f(v, 4, &r, 0), StatusOk);
    EXPECT_EQ(r, 2.0f);
    // The remainder is added after the partial sums: (2^53 + 0) + 1 is lost.
    const float w[5] = {big, 0.0f, 0.0f, 0.0f, 1.0f};
    ASSERT_EQ(z.zorsSum_32f(w, 5, &r, 12345), StatusOk);
    EXPECT_EQ(r, big);
    const float m[4] = {1, 2, 3, 4};
    ASSERT_EQ(z.zorsMean_32f(m, 4, &r, 2), StatusOk);
    EXPECT_EQ(r, 2.5f);
    ASSERT_EQ(z.zorsMean_32f(m, 3, &r, 0), StatusOk);
    EXPECT_EQ(r, 2.0f);
    // Double accumulation: a million 0.1f sum to the double result rounded once.
    std::vector<float> tenth(1000000, 0.1f);
    ASSERT_EQ(z.zorsSum_32f(tenth.data(), 1000000, &r, 0), StatusOk);
    EXPECT_NEAR(r, 1000000.0 * double(0.1f), 0.02);
    ASSERT_EQ(z.zorsMean_32f(tenth.data(), 1000000, &r, 0), StatusOk);
    EXPECT_NEAR(r, 0.1f, 1e-8);
}

TEST_P(VecStats, StandardDeviationIsTheSampleForm) {
    const Api& z = this->z();
    const float v[4] = {1, 2, 3, 4};
    float r;
    ASSERT_EQ(z.zorsStdDev_32f(v, 4, &r, 0), StatusOk);
    EXPECT_EQ(r, static_cast<float>(std::sqrt(5.0 / 3.0)));
    EXPECT_NEAR(r, 1.2909944f, 1e-7);
    const float same[7] = {0.1f, 0.1f, 0.1f, 0.1f, 0.1f, 0.1f, 0.1f};
    ASSERT_EQ(z.zorsStdDev_32f(same, 7, &r, 0), StatusOk);
    EXPECT_EQ(r, 0.0f);  // n Q - S^2 not positive
    const float two[2] = {-3, 5};
    ASSERT_EQ(z.zorsStdDev_32f(two, 2, &r, 0), StatusOk);
    EXPECT_EQ(r, static_cast<float>(std::sqrt(32.0)));
}

TEST_P(VecStats, DotProductAndNormsUseEightPartialSums) {
    const Api& z = this->z();
    const float big = 9007199254740992.0f;
    // Element i goes to partial sum i mod 8: 2^53 and -2^53 (elements 0 and 8)
    // cancel in sum 0 while the ones survive in sum 1.
    std::vector<float> a(16, 0.0f), ones(16, 1.0f);
    a[0] = big;
    a[1] = 1.0f;
    a[8] = -big;
    a[9] = 1.0f;
    float r;
    ASSERT_EQ(z.zorsDotProd_32f(a.data(), ones.data(), 16, &r), StatusOk);
    EXPECT_EQ(r, 2.0f);
    // Combination ((s0 + s2) + (s4 + s6)) + ((s1 + s3) + (s5 + s7)): the odd
    // group's 2^53 swallows its 1, then the even group's -2^53 cancels it.
    std::vector<float> b(8, 0.0f);
    b[0] = -big;
    b[1] = big;
    b[3] = 1.0f;
    ASSERT_EQ(z.zorsDotProd_32f(b.data(), ones.data(), 8, &r), StatusOk);
    EXPECT_EQ(r, 0.0f);
    // Products in double, exact: (1 + 2^-12)^2 - 1 keeps 2^-24.
    const float p[2] = {1.0f + 0x1p-12f, -1.0f}, q[2] = {1.0f + 0x1p-12f, 1.0f};
    ASSERT_EQ(z.zorsDotProd_32f(p, q, 2, &r), StatusOk);
    EXPECT_EQ(r, 0x1p-11f + 0x1p-24f);

    const float v[3] = {3, 4, 12};
    ASSERT_EQ(z.zorsNorm_L2_32f(v, 3, &r), StatusOk);
    EXPECT_EQ(r, 13.0f);
    const float big2[2] = {3e30f, 4e30f};  // the squares overflow float but not double
    ASSERT_EQ(z.zorsNorm_L2_32f(big2, 2, &r), StatusOk);
    EXPECT_NEAR(r, 5e30f, 1e24f);
    const float u[3] = {4, 6, 0}, w[3] = {1, 2, -12};
    ASSERT_EQ(z.zorsNormDiff_L2_32f(u, w, 3, &r), StatusOk);
    EXPECT_EQ(r, 13.0f);
}

TEST_P(VecStats, AgreesWithGenericOnGuardedBuffers) {
    const Api& z = this->z();
    const Api& g = zt::api(0);
    uint32_t seed = 100;
    for (int n : kLengths) {
        for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
            // Mixed magnitudes make the order of additions visible.
            auto a = randomFloats(n, seed++), b = randomFloats(n, seed++, 1e-3f);
            for (int i = 0; i < n; i += 5) a[i] *= 1e7f;
            GuardedCopy<float> ga(a, where), gb(b, where);
            float r1, r2;
            ASSERT_EQ(z.zorsSum_32f(ga.p(), n, &r1, 0), g.zorsSum_32f(a.data(), n, &r2, 0));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "sum n=" << n;
            ASSERT_EQ(z.zorsMean_32f(ga.p(), n, &r1, 0), g.zorsMean_32f(a.data(), n, &r2, 0));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "mean n=" << n;
            ASSERT_EQ(z.zorsStdDev_32f(ga.p(), n, &r1, 0), g.zorsStdDev_32f(a.data(), n, &r2, 0));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "stddev n=" << n;
            ASSERT_EQ(z.zorsDotProd_32f(ga.p(), gb.p(), n, &r1), g.zorsDotProd_32f(a.data(), b.data(), n, &r2));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "dot n=" << n;
            ASSERT_EQ(z.zorsNorm_L2_32f(ga.p(), n, &r1), g.zorsNorm_L2_32f(a.data(), n, &r2));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "norm n=" << n;
            ASSERT_EQ(z.zorsNormDiff_L2_32f(ga.p(), gb.p(), n, &r1), g.zorsNormDiff_L2_32f(a.data(), b.data(), n, &r2));
            EXPECT_EQ(bitsOf(r1), bitsOf(r2)) << "normdiff n=" << n;
        }
    }
}

// ---- extrema ------------------------------------------------------------------------

TEST_P(VecExtrema, TiesKeepTheFirstIndex) {
    const Api& z = this->z();
    const float v[4] = {3, 7, 7, 1};
    float m;
    int idx = -1;
    ASSERT_EQ(z.zorsMaxIndx_32f(v, 4, &m, &idx), StatusOk);
    EXPECT_EQ(m, 7.0f);
    EXPECT_EQ(idx, 1);
    ASSERT_EQ(z.zorsMaxIndx_32f(v, 1, &m, &idx), StatusOk);
    EXPECT_EQ(m, 3.0f);
    EXPECT_EQ(idx, 0);
    const int16_t s[5] = {-5, 9, 2, 9, 9};
    int16_t ms;
    ASSERT_EQ(z.zorsMaxIndx_16s(s, 5, &ms, nullptr), StatusOk);  // a null index is allowed
    EXPECT_EQ(ms, 9);
    ASSERT_EQ(z.zorsMaxIndx_16s(s, 5, &ms, &idx), StatusOk);
    EXPECT_EQ(idx, 1);
    ASSERT_EQ(z.zorsMax_16s(s, 5, &ms), StatusOk);
    EXPECT_EQ(ms, 9);
    const double d[3] = {-1, -0.5, -0.5};
    double md;
    ASSERT_EQ(z.zorsMaxIndx_64f(d, 3, &md, &idx), StatusOk);
    EXPECT_EQ(md, -0.5);
    EXPECT_EQ(idx, 1);
    ASSERT_EQ(z.zorsMaxIndx_64f(d, 3, &md, nullptr), StatusOk);
    ASSERT_EQ(z.zorsMax_64f(d, 3, &md), StatusOk);
    EXPECT_EQ(md, -0.5);
    ASSERT_EQ(z.zorsMin_32f(v, 4, &m), StatusOk);
    EXPECT_EQ(m, 1.0f);

    // Zeros of both signs compare equal: the first one is kept, sign and all.
    std::vector<float> zs(37, -1.0f);
    zs[5] = -0.0f;
    zs[20] = 0.0f;
    zs[30] = -0.0f;
    ASSERT_EQ(z.zorsMaxIndx_32f(zs.data(), 37, &m, &idx), StatusOk);
    EXPECT_EQ(bitsOf(m), 0x80000000u);
    EXPECT_EQ(idx, 5);
    ASSERT_EQ(z.zorsMax_32f(zs.data(), 37, &m), StatusOk);
    EXPECT_EQ(bitsOf(m), 0x80000000u);
    for (auto& x : zs) x = x == -1.0f ? 1.0f : x;
    zs[5] = 0.0f;
    zs[20] = -0.0f;
    ASSERT_EQ(z.zorsMin_32f(zs.data(), 37, &m), StatusOk);
    EXPECT_EQ(bitsOf(m), 0u);
}

TEST_P(VecExtrema, NaNsNeverReplaceButALeadingNaNStays) {
    const Api& z = this->z();
    std::vector<float> v(41, 1.0f);
    v[3] = kNaN;
    v[17] = 5.0f;
    v[40] = kNaN;
    float m;
    int idx;
    ASSERT_EQ(z.zorsMaxIndx_32f(v.data(), 41, &m, &idx), StatusOk);
    EXPECT_EQ(m, 5.0f);
    EXPECT_EQ(idx, 17);
    ASSERT_EQ(z.zorsMin_32f(v.data(), 41, &m), StatusOk);
    EXPECT_EQ(m, 1.0f);
    v[0] = kNaN;
    ASSERT_EQ(z.zorsMaxIndx_32f(v.data(), 41, &m, &idx), StatusOk);
    EXPECT_TRUE(std::isnan(m));
    EXPECT_EQ(idx, 0);
    ASSERT_EQ(z.zorsMin_32f(v.data(), 41, &m), StatusOk);
    EXPECT_TRUE(std::isnan(m));
    std::vector<double> d(9, -kInf);
    d[4] = std::numeric_limits<double>::quiet_NaN();
    d[6] = -7;
    double md;
    ASSERT_EQ(z.zorsMaxIndx_64f(d.data(), 9, &md, &idx), StatusOk);
    EXPECT_EQ(md, -7.0);
    EXPECT_EQ(idx, 6);
}

TEST_P(VecExtrema, AgreesWithASequentialScan) {
    const Api& z = this->z();
    uint32_t seed = 7;
    for (int n : kLengths) {
        for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
            // Few distinct values: many ties, the extreme anywhere.
            std::mt19937 rng(seed++);
            std::uniform_int_distribution<int> few(-20, 20), pos(0, n - 1);
            std::vector<float> f(n);
            std::vector<int16_t> s(n);
            std::vector<double> d(n);
            for (int i = 0; i < n; ++i) {
                f[i] = few(rng) * 0.5f;
                s[i] = static_cast<int16_t>(few(rng) * 1000);
                d[i] = few(rng) * 0.25;
            }
            f[pos(rng)] = 77.0f;
            if (n > 3) s[n - 1] = 32767;
            GuardedCopy<float> gf(f, where);
            GuardedCopy<int16_t> gs(s, where);
            GuardedCopy<double> gd(d, where);
            auto firstBest = [](const auto& v, bool max) {
                int k = 0;
                for (int i = 1; i < static_cast<int>(v.size()); ++i)
                    if (max ? v[i] > v[k] : v[i] < v[k]) k = i;
                return k;
            };
            float mf;
            int16_t ms;
            double md;
            int idx;
            ASSERT_EQ(z.zorsMaxIndx_32f(gf.p(), n, &mf, &idx), StatusOk);
            EXPECT_EQ(idx, firstBest(f, true));
            EXPECT_EQ(mf, f[idx]);
            ASSERT_EQ(z.zorsMax_32f(gf.p(), n, &mf), StatusOk);
            EXPECT_EQ(mf, f[firstBest(f, true)]);
            ASSERT_EQ(z.zorsMin_32f(gf.p(), n, &mf), StatusOk);
            EXPECT_EQ(mf, f[firstBest(f, false)]);
            ASSERT_EQ(z.zorsMaxIndx_16s(gs.p(), n, &ms, &idx), StatusOk);
            EXPECT_EQ(idx, firstBest(s, true));
            EXPECT_EQ(ms, s[idx]);
            ASSERT_EQ(z.zorsMax_16s(gs.p(), n, &ms), StatusOk);
            EXPECT_EQ(ms, s[firstBest(s, true)]);
            ASSERT_EQ(z.zorsMaxIndx_64f(gd.p(), n, &md, &idx), StatusOk);
            EXPECT_EQ(idx, firstBest(d, true));
            ASSERT_EQ(z.zorsMax_64f(gd.p(), n, &md), StatusOk);
            EXPECT_EQ(md, d[firstBest(d, true)]);
        }
    }
}

// ---- integer reductions --------------------------------------------------------------

TEST_P(VecIntStats, L1NormTruncates) {
    const Api& z = this->z();
    const int16_t three = 3;
    int32_t r;
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(&three, 1, &r, 1), StatusOk);
    EXPECT_EQ(r, 1);
    const int16_t v[4] = {-32768, 32767, -1, 0};
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, 0), StatusOk);
    EXPECT_EQ(r, 65536);
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, 3), StatusOk);
    EXPECT_EQ(r, 8192);
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, 17), StatusOk);
    EXPECT_EQ(r, 0);  // 65536 >> 17 truncates to 0
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, 32), StatusOk);
    EXPECT_EQ(r, 0);
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, -14), StatusOk);
    EXPECT_EQ(r, 65536 << 14);
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(v, 4, &r, -15), StatusOk);
    EXPECT_EQ(r, 2147483647);  // saturates
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(&three, 1, &r, -100), StatusOk);
    EXPECT_EQ(r, 2147483647);  // acts as -31
    const int16_t one = 1;
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(&one, 1, &r, -40), StatusOk);
    EXPECT_EQ(r, 2147483647);  // 1 << 31 leaves the range

    // Longer than 65536: a 64-bit total; shifts up to 63 still count.
    std::vector<int16_t> big(200000, -32768);
    const int64_t total = int64_t(200000) * 32768;
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(big.data(), 200000, &r, 0), StatusOk);
    EXPECT_EQ(r, 2147483647);
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(big.data(), 200000, &r, 5), StatusOk);
    EXPECT_EQ(r, static_cast<int32_t>(total >> 5));
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(big.data(), 200000, &r, 32), StatusOk);
    EXPECT_EQ(r, static_cast<int32_t>(total >> 32));
    ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(big.data(), 200000, &r, 64), StatusOk);
    EXPECT_EQ(r, 0);
}

TEST_P(VecIntStats, DotProductRoundsTiesToEvenAndSaturates) {
    const Api& z = this->z();
    const int16_t a[2] = {1, 2}, b[2] = {1, 1}, c[2] = {2, 3};
    int32_t r;
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(a, b, 2, &r, 1), StatusOk);
    EXPECT_EQ(r, 2);  // 1.5
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(c, b, 2, &r, 1), StatusOk);
    EXPECT_EQ(r, 2);  // 2.5
    const int16_t m[2] = {-1, -2};
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(m, c, 2, &r, 2), StatusOk);
    EXPECT_EQ(r, -2);  // -8 / 4
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(m, b, 2, &r, 1), StatusOk);
    EXPECT_EQ(r, -2);  // -1.5 to even

    // Exact 64-bit sums: products of -32768 overflow 32 bits quickly.
    std::vector<int16_t> x(5000, -32768);
    const int64_t total = int64_t(5000) << 30;
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(x.data(), x.data(), 5000, &r, 0), StatusOk);
    EXPECT_EQ(r, 2147483647);
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(x.data(), x.data(), 5000, &r, 13), StatusOk);
    EXPECT_EQ(r, static_cast<int32_t>(total >> 13));
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(x.data(), x.data(), 5000, &r, 31), StatusOk);
    EXPECT_EQ(r, static_cast<int32_t>((total + (int64_t(1) << 30)) >> 31));
    int32_t r40;
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(x.data(), x.data(), 5000, &r40, 40), StatusOk);
    EXPECT_EQ(r40, r);  // above 31 acts as 31
    std::vector<int16_t> y(5000, 32767);
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(x.data(), y.data(), 5000, &r, 0), StatusOk);
    EXPECT_EQ(r, -2147483647 - 1);
    // Negative factors: shifted left unless the result leaves 32 bits.
    const int16_t s3 = 3, s1 = 1, sm = -1;
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(&s3, &s1, 1, &r, -4), StatusOk);
    EXPECT_EQ(r, 48);
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(&s3, &s1, 1, &r, -30), StatusOk);
    EXPECT_EQ(r, 2147483647);
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(&sm, &s1, 1, &r, -31), StatusOk);
    EXPECT_EQ(r, -2147483647 - 1);
    ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(&sm, &s1, 1, &r, -99), StatusOk);
    EXPECT_EQ(r, -2147483647 - 1);

    // Random: against the exact sum and the plain rounding rule.
    for (int n : kLengths) {
        const auto p = randomShorts(n, n), q = randomShorts(n, n + 1);
        int64_t s = 0;
        for (int i = 0; i < n; ++i) s += int64_t(p[i]) * q[i];
        for (int sf : {0, 1, 9, 20, 31}) {
            ASSERT_EQ(z.zorsDotProd_16s32s_Sfs(p.data(), q.data(), n, &r, sf), StatusOk);
            const double e = std::nearbyint(std::ldexp(double(s), -sf));  // ties to even
            EXPECT_EQ(r, static_cast<int32_t>(std::clamp(e, -2147483648.0, 2147483647.0))) << n << " " << sf;
        }
    }
}

TEST_P(VecIntStats, L2NormOfShortsIsExact) {
    const Api& z = this->z();
    const int16_t v[3] = {3, -4, 12};
    float r;
    ASSERT_EQ(z.zorsNorm_L2_16s32f(v, 3, &r), StatusOk);
    EXPECT_EQ(r, 13.0f);
    std::vector<int16_t> m(70000, -32768);
    ASSERT_EQ(z.zorsNorm_L2_16s32f(m.data(), 70000, &r), StatusOk);
    EXPECT_EQ(r, static_cast<float>(std::sqrt(70000.0) * 32768.0));
    for (int n : kLengths) {
        const auto p = randomShorts(n, 3 * n);
        GuardedCopy<int16_t> g(p, zt::Guard::After);
        int64_t s = 0;
        for (int16_t x : p) s += int64_t(x) * x;
        ASSERT_EQ(z.zorsNorm_L2_16s32f(g.p(), n, &r), StatusOk);
        EXPECT_EQ(r, static_cast<float>(std::sqrt(static_cast<double>(s)))) << n;
        int32_t l1;
        int64_t a = 0;
        for (int16_t x : p) a += std::abs(int(x));
        ASSERT_EQ(z.zorsNorm_L1_16s32s_Sfs(g.p(), n, &l1, 4), StatusOk);
        EXPECT_EQ(l1, static_cast<int32_t>(std::min<int64_t>(a >> 4, 2147483647))) << n;
    }
}

ZT_ALL_VARIANTS(VecStats);
ZT_ALL_VARIANTS(VecExtrema);
ZT_ALL_VARIANTS(VecIntStats);
