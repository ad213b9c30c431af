// Image reductions: exact integer and double references over random and
// saturated images, the accurate float sum's order, the float extrema rule,
// early exits, variant agreement (the fast float sum against the SSE
// variant's, its one documented exception) and the check orders.
#include <cmath>

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Reductions : public zt::VariantTest {};

struct Exact {
    int64_t sum = 0, squares = 0;
    int lo = 1 << 30, hi = -1, loX = 0, loY = 0, hiX = 0, hiY = 0;  // first occurrences
    void add(int v, int x, int y) {
        sum += v, squares += int64_t(v) * v;
        if (v < lo) lo = v, loX = x, loY = y;
        if (v > hi) hi = v, hiX = x, hiY = y;
    }
};

// Rows up to 140001 pixels fold every SIMD accumulator; all-maximum images
// are their worst case.
TEST_P(Reductions, MatchExactReferences) {
    const auto& z = this->z();
    std::mt19937 rng(variant());
    for (ImageSize r : {ImageSize{1, 1}, ImageSize{5, 3}, ImageSize{16, 2}, ImageSize{45, 5}, ImageSize{140001, 1}})
        for (bool saturated : {false, true}) {
            zt::GuardedImage<uint8_t> a(3 * r.width, r.height, 0, 3), b(3 * r.width, r.height, 0, 1);
            zt::GuardedImage<uint16_t> w(3 * r.width, r.height, 0, 4);
            a.fill([&](int, int) { return saturated ? 255 : int(rng() % 256); });
            b.fill([&](int, int) { return rng() % 256; });
            w.fill([&](int, int) { return saturated ? 65535 : int(rng() % 16 ? rng() : rng() % 4); });
            Exact all, l1, c8[3], c16[3];
            for (int y = 0; y < r.height; ++y)
                for (int x = 0; x < 3 * r.width; ++x) {
                    all.add(*a.at(x, y), x, y);
                    l1.add(std::abs(*a.at(x, y) - *b.at(x, y)), x, y);
                    c8[x % 3].add(*a.at(x, y), x / 3, y);
                    c16[x % 3].add(*w.at(x, y), x / 3, y);
                }
            zor::DoublePrecisionScope fpu;
            const double n = double(r.width) * r.height;
            const ImageSize r3{3 * r.width, r.height};
            double d[3], e[3];
            ASSERT_EQ(z.zoriSum_8u_C1R(a.roi(), a.step(), r3, d), StatusOk);
            EXPECT_EQ(d[0], double(all.sum));
            ASSERT_EQ(z.zoriMean_8u_C1R(a.roi(), a.step(), r3, d), StatusOk);
            EXPECT_EQ(d[0], zor::toDouble(all.sum / (3 * n)));
            ASSERT_EQ(z.zoriNormDiff_L1_8u_C1R(a.roi(), a.step(), b.roi(), b.step(), r3, d), StatusOk);
            EXPECT_EQ(d[0], double(l1.sum));
            uint8_t m = 0, mn[3], mx[3];
            EXPECT_TRUE(z.zoriMax_8u_C1R(a.roi(), a.step(), r3, &m) == StatusOk && m == all.hi);
            ASSERT_EQ(z.zoriMinMax_8u_C3R(a.roi(), a.step(), r, mn, mx), StatusOk);
            ASSERT_EQ(z.zoriMean_8u_C3R(a.roi(), a.step(), r, e), StatusOk);
            for (int c = 0; c < 3; ++c) {
                EXPECT_TRUE(mn[c] == c8[c].lo && mx[c] == c8[c].hi);
                EXPECT_EQ(e[c], zor::toDouble(c8[c].sum * zor::toDouble(1.0 / n)));
                for (bool wide : {false, true}) {
                    const Exact& t = wide ? c16[c] : c8[c];
                    const double mean = zor::toDouble(t.sum / n);
                    const double dev = std::sqrt(std::fabs(zor::toDouble(t.squares / n) - zor::toDouble(mean * mean)));
                    const Status st = wide ? z.zoriMean_StdDev_16u_C3CR(w.roi(), w.step(), r, c + 1, d, d + 1)
                                           : z.zoriMean_StdDev_8u_C3CR(a.roi(), a.step(), r, c + 1, d, d + 1);
                    EXPECT_TRUE(st == StatusOk && d[0] == mean && d[1] == zor::toDouble(dev)) << c << " " << r.width;
                }
                float lo, hi;
                ImagePoint pl, ph;
                ASSERT_EQ(z.zoriMinMaxIndx_16u_C3CR(w.roi(), w.step(), r, c + 1, &lo, &hi, &pl, &ph), StatusOk);
                EXPECT_TRUE(lo == float(c16[c].lo) && hi == float(c16[c].hi));
                EXPECT_TRUE(pl.x == c16[c].loX && pl.y == c16[c].loY && ph.x == c16[c].hiX && ph.y == c16[c].hiY);
            }
        }
}

// Accurate sum: even and odd columns in two doubles over the whole ROI.
TEST_P(Reductions, AccurateFloatSumOrder) {
    const auto& z = this->z();
    const float big = 9007199254740992.0f;  // 2^53: adding 1 to it in double is lost
    const float odd[3] = {big, 1, 1}, rows[2][2] = {{big, 1}, {1, 1}};
    double s = 0;
    for (int hint : variant() ? std::vector<int>{2} : std::vector<int>{2, 0, -1}) {
        // the last column goes to the even total; the two odd columns sum apart
        EXPECT_TRUE(z.zoriSum_32f_C1R(odd, 12, {3, 1}, &s, hint) == StatusOk && s == 9007199254740992.0);
        EXPECT_TRUE(z.zoriSum_32f_C1R(rows[0], 8, {2, 2}, &s, hint) == StatusOk && s == 9007199254740994.0);
    }
    // eighths below 2^10: every order sums exactly, the fast sum too
    std::mt19937 rng(1);
    zt::GuardedImage<float> f(77, 9);
    int64_t eighths = 0;
    f.fill([&](int, int) {
        const int e = int(rng() % 16001) - 8000;
        return eighths += e, float(e) / 8;
    });
    for (int hint : {2, 0})
        EXPECT_TRUE(z.zoriSum_32f_C1R(f.roi(), f.step(), {77, 9}, &s, hint) == StatusOk && s == eighths / 8.0);
}

TEST_P(Reductions, FloatExtremaFollowTheScanRule) {
    const auto& z = this->z();
    float lo, hi;
    const float afterNan[4] = {1, std::nanf(""), 100, 2};  // 100 only replaces the NaN minimum
    const uint32_t first[3] = {0x7fa00001, 0x40400000, 0x40a00000};  // a signalling NaN, 3, 5: copied bit for bit
    EXPECT_TRUE(z.zoriMinMax_32f_C1R(afterNan, 16, {4, 1}, &lo, &hi) == StatusOk && lo == 2 && hi == 1);
    const float* firstF = reinterpret_cast<const float*>(first);
    EXPECT_TRUE(z.zoriMinMax_32f_C1R(firstF, 12, {3, 1}, &lo, &hi) == StatusOk && lo == 3 && !std::memcmp(&hi, first, 4));
    for (float zero : {0.0f, -0.0f}) {  // the first zero in raster order is kept
        const float img[2][5] = {{5, 5, 5, 5, zero}, {-zero, 7, 7, 7, 7}}, neg[2][5] = {{-5, -5, -5, -5, -zero}, {zero}};
        EXPECT_TRUE(z.zoriMinMax_32f_C1R(img[0], 20, {5, 2}, &lo, &hi) == 0 && zt::sameBits(lo, zero) && hi == 7);
        EXPECT_TRUE(z.zoriMinMax_32f_C1R(neg[0], 20, {5, 2}, &lo, &hi) == 0 && lo == -5 && zt::sameBits(hi, -zero));
    }
}

// Nothing past the row that settles the result is read: the next row lies
// behind a protected page.
TEST_P(Reductions, EarlyExitsReadNoFurtherRows) {
    zt::GuardedBuffer row(60);
    std::memset(row.data(), 9, 60);
    std::memset(row.data() + 3, 0, 3);
    std::memset(row.data() + 57, 255, 3);
    uint8_t m = 0, mn[3], mx[3];
    EXPECT_TRUE(z().zoriMax_8u_C1R(row.data(), 60, {60, 1000}, &m) == StatusOk && m == 255);
    EXPECT_TRUE(z().zoriMinMax_8u_C3R(row.data(), 60, {20, 1000}, mn, mx) == StatusOk && mn[0] + mn[1] + mn[2] == 0 &&
                mx[0] + mx[1] + mx[2] == 765);
}

// The fast float sum (hint 0) is the documented exception: the generic
// variant has none, so its run takes the SSE variant's, which every SIMD
// variant must match.
TEST_P(Reductions, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const zt::Api& fast = &z == &zt::api(0) ? zt::api(1) : z;
        const ImageSize r = c.roi(), r3{3 * r.width, r.height};
        const auto a = c.inImage<uint8_t>(r3.width, r.height), b = c.inImage<uint8_t>(r3.width, r.height);
        const auto w = c.inImage<uint16_t>(r3.width, r.height);
        const auto f = c.inImage<float>(r3.width, r.height);
        double* d = c.out<double>(13);
        uint8_t* u = c.out<uint8_t>(7);
        float* v = c.out<float>(4);
        ImagePoint* p = c.out<ImagePoint>(2);
        const int coi = 1 + c.index() % 3;
        return z.zoriSum_8u_C1R(a.p, a.step, r3, d) | z.zoriSum_32f_C1R(f.p, f.step, r3, d + 1, 2) |
               z.zoriMean_8u_C1R(a.p, a.step, r3, d + 2) | z.zoriMean_8u_C3R(a.p, a.step, r, d + 3) |
               z.zoriMean_StdDev_8u_C3CR(a.p, a.step, r, coi, d + 6, d + 7) |
               z.zoriMean_StdDev_16u_C3CR(w.p, w.step, r, coi, d + 8, d + 9) |
               z.zoriNormDiff_L1_8u_C1R(a.p, a.step, b.p, b.step, r3, d + 10) |
               z.zoriMinMax_32f_C1R(f.p, f.step, r3, v, v + 1) | z.zoriMinMax_8u_C3R(a.p, a.step, r, u, u + 3) |
               z.zoriMax_8u_C1R(a.p, a.step, r3, u + 6) |
               z.zoriMinMaxIndx_16u_C3CR(w.p, w.step, r, coi, v + 2, v + 3, p, p + 1) |
               fast.zoriSum_32f_C1R(f.p, f.step, r3, d + 12, 0);
    });
}

TEST_P(Reductions, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[64] = {}, mn[3], mx[3];
    uint16_t w[32] = {};
    float f[16] = {}, lo, hi;
    double d[3] = {};
    ImagePoint p, q;
    const ImageSize r{2, 2}, empty{2, 0};
    const auto size = zt::bad(StatusBadSize, zt::arg<2>(empty));
    const auto first = zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<2>(empty));
    const std::vector<zt::Watch> out{zt::watch(d, sizeof d)};
    zt::expectChecks(z.zoriSum_8u_C1R, {s, 0, r, d}, out, zt::eachNull(), size, first);
    zt::expectChecks(z.zoriSum_32f_C1R, {f + 2, -8, r, d, 99}, out, zt::eachNull(), size, first);
    zt::expectChecks(z.zoriMean_8u_C1R, {s, 0, r, d}, out, zt::eachNull(), size, first);
    zt::expectChecks(z.zoriMean_8u_C3R, {s, 6, r, d}, out, zt::eachNull(), size, first);
    zt::expectChecks(z.zoriMean_StdDev_8u_C3CR, {s, 6, r, 1, d, d + 1}, out, zt::eachNull(StatusNullPointer, {4, 5}),
                     size, first, zt::bad(StatusBadStep, zt::arg<1>(5), zt::arg<3>(0)),
                     zt::bad(StatusBadChannelOfInterest, zt::arg<3>(4)),
                     zt::bad(StatusOk, zt::arg<4>(nullptr), zt::arg<5>(nullptr)));
    zt::expectChecks(z.zoriMean_StdDev_16u_C3CR, {w, 12, r, 2, d, d + 1}, out,
                     zt::eachNull(StatusNullPointer, {4, 5}), size, zt::bad(StatusBadStep, zt::arg<1>(10)),
                     zt::bad(StatusNotEvenStep, zt::arg<1>(13), zt::arg<3>(0)),
                     zt::bad(StatusBadChannelOfInterest, zt::arg<3>(0)));
    zt::expectChecks(z.zoriMinMaxIndx_16u_C3CR, {w, 12, r, 3, &lo, &hi, &p, &q},
                     {zt::watch(&lo, 4), zt::watch(&hi, 4), zt::watch(&p, 8), zt::watch(&q, 8)},
                     zt::eachNull(StatusNullPointer, {4, 5, 6, 7}), size, zt::bad(StatusBadStep, zt::arg<1>(-12)),
                     zt::bad(StatusNotEvenStep, zt::arg<1>(15)), zt::bad(StatusBadChannelOfInterest, zt::arg<3>(4)));
    zt::expectChecks(z.zoriMinMax_32f_C1R, {f, 0, r, &lo, &hi}, {zt::watch(&lo, 4), zt::watch(&hi, 4)},
                     zt::eachNull(), size, first);
    zt::expectChecks(z.zoriMinMax_8u_C3R, {s, 0, r, mn, mx}, {zt::watch(mn, 3), zt::watch(mx, 3)}, zt::eachNull(),
                     size, first);
    zt::expectChecks(z.zoriMax_8u_C1R, {s, 0, r, mn}, {zt::watch(mn, 1)}, zt::eachNull(), size, first);
    zt::expectChecks(z.zoriNormDiff_L1_8u_C1R, {s, 2, s, 2, r, d}, out, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<4>(empty), zt::arg<3>(0)), zt::bad(StatusBadStep, zt::arg<1>(0)),
                     zt::bad(StatusBadStep, zt::arg<3>(-2)));
}

}  // namespace

ZT_ALL_VARIANTS(Reductions);
