// Vector statistics, on every variant's entries.
#include <gtest/gtest.h>

#include <cmath>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecStats : public zt::VariantTest {};

uint32_t bitsOf(float x) { uint32_t u; std::memcpy(&u, &x, 4); return u; }
float floatOf(uint32_t u) { float x; std::memcpy(&x, &u, 4); return x; }
long double halfUlp(float x) { return 0.5L * (std::nextafter(std::fabs(x), INFINITY) - std::fabs(x)); }

// Pointers, then length argument L; argument L + 2 (the index of an
// extremum) may be null.
template <size_t L, class... P, class... A>
void checks(const std::vector<zt::Watch>& w, Status(ZOR_CALL* fn)(P...), A... a) {
    zt::expectChecks(fn, std::tuple<P...>(a...), w, zt::eachNull(StatusNullPointer, {L + 2}), zt::badLength<L>());
}

}  // namespace

// The extrema share one check, run here through one of them.  The sample
// deviation needs two elements.
TEST_P(VecStats, ChecksComeInOrderAndWriteNothing) {
    const float f[4] = {1, 2, 3, 4};
    const int16_t s[4] = {1, 2, 3, 4};
    struct { float f = 42; int16_t s = 42; int32_t i = 42; int idx = 42; } o;
    const std::vector<zt::Watch> w{zt::watch(&o, sizeof o)};
    for (auto fn : {z().zorsSum_32f, z().zorsMean_32f, z().zorsStdDev_32f}) checks<1>(w, fn, f, 4, &o.f, 0);
    checks<1>(w, z().zorsNorm_L2_32f, f, 4, &o.f), checks<1>(w, z().zorsNorm_L2_16s32f, s, 4, &o.f);
    checks<1>(w, z().zorsNorm_L1_16s32s_Sfs, s, 4, &o.i, 0), checks<1>(w, z().zorsMaxIndx_16s, s, 4, &o.s, &o.idx);
    for (auto fn : {z().zorsNormDiff_L2_32f, z().zorsDotProd_32f}) checks<2>(w, fn, f, f, 4, &o.f);
    checks<2>(w, z().zorsDotProd_16s32s_Sfs, s, s, 4, &o.i, 0);
    zt::expectChecks(z().zorsStdDev_32f, {f, 4, &o.f, 0}, w, zt::bad(StatusBadSize, zt::arg<1>(1)));
}

// Sums of mixed magnitudes show any change in the order of additions;
// extrema run on few distinct values (ties everywhere) or on specials.
TEST_P(VecStats, AgreesWithGeneric) {
    struct Results { float r[10]; int16_t s[2]; int32_t l1, dot; int at[3]; double d[2]; };
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const int n = c.len();
        float* a = c.in<float>(n);
        for (int i = 0; i < n; i += 5) a[i] *= 1e7f;
        const float *b = c.in<float>(n, -1e-3, 1e-3), *f = c.index() % 2 ? c.in<float>(n, -20, 20) : c.in(c.floats(n));
        const int16_t *s = c.in<int16_t>(n), *t = c.in<int16_t>(n, -20, 20);
        const double* d = c.in<double>(n, -3, 3);
        Results& o = *c.out<Results>(1);
        return z.zorsSum_32f(a, n, o.r, 0) + z.zorsMean_32f(a, n, o.r + 1, 0) + z.zorsStdDev_32f(a, n, o.r + 2, 0) +
               z.zorsDotProd_32f(a, b, n, o.r + 3) + z.zorsNorm_L2_32f(a, n, o.r + 4) +
               z.zorsNormDiff_L2_32f(a, b, n, o.r + 5) + z.zorsNorm_L2_16s32f(s, n, o.r + 6) +
               z.zorsNorm_L1_16s32s_Sfs(s, n, &o.l1, 3) + z.zorsDotProd_16s32s_Sfs(s, c.in<int16_t>(n), n, &o.dot, 7) +
               z.zorsMax_32f(f, n, o.r + 7) + z.zorsMin_32f(f, n, o.r + 8) + z.zorsMaxIndx_32f(f, n, o.r + 9, o.at) +
               z.zorsMax_16s(t, n, o.s) + z.zorsMaxIndx_16s(t, n, o.s + 1, o.at + 1) + z.zorsMax_64f(d, n, o.d) +
               z.zorsMaxIndx_64f(d, n, o.d + 1, o.at + 2);
    });
}

// The sum takes the even and the odd elements of each group of four into two
// partial sums, the remainder after them (left to right would give 2); the
// mean divides that sum in double.  The deviation is 0 where n Q - S^2 comes
// out negative.  A NaN result of the dot product and norms is the input NaN
// with the largest payload (the first of equals), quieted, whatever NaNs meet
// in the sums; the default NaN where no input is one (inf * 0, inf - inf).
// Extrema keep the first of equals (zeros of both signs compare equal); a NaN
// never replaces, but a leading one stays; the index may be null.
TEST_P(VecStats, PinnedValues) {
    const auto& z = this->z();
    const float big = 0x1p53f, v[5] = {big, 1, -big, 1, 1}, m[4] = {1, 2, 3, 4}, t[3] = {1, 1.5f, 0.7f};
    std::vector<float> x(239, 0x1.255f0ep+3f), y(70, 1.0f), w(8, 1.0f);
    x[121] = 0x1.255f10p+3f;
    float r[4];
    ASSERT_EQ(z.zorsSum_32f(v, 5, r, 12345) + z.zorsMean_32f(t, 3, r + 1, 0) + z.zorsStdDev_32f(m, 4, r + 2, 0) +
                  z.zorsStdDev_32f(x.data(), 239, r + 3, 0), StatusOk);
    EXPECT_EQ(std::vector<float>(r, r + 4), (std::vector<float>{3, float((2.5 + 0.7f) / 3), 1.2909944f, 0}));

    x.assign(70, 1.0f), x[5] = w[5] = INFINITY, y[5] = 0, x[10] = floatOf(0x7F800003u), x[40] = floatOf(0x7FC00001u);
    x[67] = floatOf(0x7FC00002u), y[66] = floatOf(0xFFC00002u), w[3] = floatOf(0x7FA00000u);
    ASSERT_EQ(z.zorsDotProd_32f(x.data(), y.data(), 8, r) + z.zorsDotProd_32f(x.data(), y.data(), 70, r + 1) +
                  z.zorsNorm_L2_32f(x.data(), 41, r + 2) + z.zorsNormDiff_L2_32f(x.data(), w.data(), 8, r + 3), 0);
    const uint32_t want[4] = {0xFFC00000u, 0xFFC00002u, 0x7FC00001u, 0x7FE00000u};
    for (int k = 0; k < 4; ++k) EXPECT_EQ(bitsOf(r[k]), want[k]) << k;

    x.assign(37, -1.0f), x[5] = x[30] = -0.0f, x[20] = 0.0f, x[3] = x[36] = NAN;
    int at[2];
    ASSERT_EQ(z.zorsMaxIndx_32f(x.data(), 37, r, at) + z.zorsMaxIndx_32f(x.data() + 3, 34, r + 1, at + 1) +
                  z.zorsMin_32f(x.data() + 6, 31, r + 2) + z.zorsMaxIndx_32f(x.data() + 6, 31, r + 3, nullptr), 0);
    EXPECT_TRUE(at[0] == 5 && bitsOf(r[0]) == 0x80000000u && at[1] == 0 && r[1] != r[1] && r[2] == -1 && !bitsOf(r[3]));

    // Every type's extremes on one picture: the largest at 23 of 41, the smallest at 9.
    std::vector<double> e(41, 1.0), dm(2);
    e[23] = 7, e[9] = -5;
    const std::vector<float> vf(e.begin(), e.end());
    const std::vector<int16_t> vs(e.begin(), e.end());
    int16_t sm[2];
    ASSERT_EQ(z.zorsMax_64f(e.data(), 41, &dm[0]) + z.zorsMaxIndx_64f(e.data(), 41, &dm[1], at) +
                  z.zorsMax_16s(vs.data(), 41, sm) + z.zorsMaxIndx_16s(vs.data(), 41, sm + 1, at + 1) +
                  z.zorsMax_32f(vf.data(), 41, r) + z.zorsMin_32f(vf.data(), 41, r + 1), 0);
    EXPECT_TRUE(dm == std::vector<double>({7, 7}) && sm[0] == 7 && sm[1] == 7 && at[0] == 23 && at[1] == 23 &&
                r[0] == 7 && r[1] == -5);
}

// Random data against long double sums: within half a float ulp of the
// exact value, give or take the double accumulation's error (far smaller).
// One length runs on values whose squares overflow float.
TEST_P(VecStats, DoubleSumsRoundTheExactValue) {
    for (int n : {5, 31, 32, 97, 1000, 4133}) {
        const std::vector<float> a = zt::randomFloats(n, n, n == 97 ? 4e25f : 4), b = zt::randomFloats(n, ~n, 4);
        long double e[5] = {}, mag[5] = {};  // dot product, squares, squared differences, sum, mean
        for (int i = 0; i < n; ++i) {
            const long double x = a[i], y = b[i], t[5] = {x * y, x * x, (x - y) * (x - y), x, x / n};
            for (int k = 0; k < 5; ++k) e[k] += t[k], mag[k] += std::fabs(t[k]);
        }
        for (int k : {1, 2}) mag[k] = e[k] = std::sqrt(e[k]);
        float r[5];
        ASSERT_EQ(z().zorsDotProd_32f(a.data(), b.data(), n, r) + z().zorsNorm_L2_32f(a.data(), n, r + 1) +
                      z().zorsNormDiff_L2_32f(a.data(), b.data(), n, r + 2) + z().zorsSum_32f(a.data(), n, r + 3, 0) +
                      z().zorsMean_32f(a.data(), n, r + 4, 0), StatusOk);
        for (int k = 0; k < 5; ++k) EXPECT_LE(std::abs(r[k] - e[k]), halfUlp(r[k]) + mag[k] * 0x1p-40L) << n << ' ' << k;
    }
}

// Exact 64-bit sums.  The L1 norm scales by truncation, the dot product with
// ties to even; factors beyond +-31 act as +-31 (the L1 norm of a long vector
// shifts right up to 63); both saturate.
TEST_P(VecStats, IntegerReductionsScaleTheExactSum) {
    std::mt19937 rng(5);
    const auto random = [&](int n) { std::vector<int16_t> v(n); zt::fillRandom(v.data(), n, rng); return v; };
    const std::vector<int16_t> low(200000, -32768), high(200000, 32767);
    const std::vector<std::pair<std::vector<int16_t>, std::vector<int16_t>>> cases = {
        {{1, 2}, {1, 1}}, {{2, 3}, {1, 1}}, {{-1, -2}, {1, 1}}, {{-32768, 1, -32768}, {-32768, 1, -32768}},
        {low, low}, {low, high}, {random(1), random(1)}, {random(37), random(37)}, {random(1003), random(1003)}};
    const auto scaled = [](double x, int e) { return std::fmax(-0x1p31, std::fmin(std::ldexp(x, e), 0x1p31 - 1)); };
    for (const auto& [p, q] : cases) {
        const int n = int(p.size());
        int64_t dot = 0, absSum = 0, squares = 0;
        for (int i = 0; i < n; ++i) dot += p[i] * q[i], absSum += std::abs(p[i]), squares += p[i] * p[i];
        for (int sf : {-99, -31, -30, -15, -4, 0, 1, 2, 9, 20, 31, 32, 40, 63, 64}) {
            int32_t l1, dp;
            float l2;
            ASSERT_EQ(z().zorsNorm_L1_16s32s_Sfs(p.data(), n, &l1, sf) + z().zorsNorm_L2_16s32f(p.data(), n, &l2) +
                          z().zorsDotProd_16s32s_Sfs(p.data(), q.data(), n, &dp, sf), StatusOk);
            EXPECT_EQ(l1, int32_t(std::trunc(scaled(absSum, sf < -31 ? 31 : -sf)))) << n << " " << sf;
            EXPECT_EQ(dp, int32_t(std::nearbyint(scaled(dot, sf > 31 ? -31 : sf < -31 ? 31 : -sf)))) << n << " " << sf;
            EXPECT_EQ(l2, float(std::sqrt(double(squares)))) << n;
        }
    }
}

ZT_ALL_VARIANTS(VecStats);
