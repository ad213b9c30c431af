// Pixel arithmetic and logic against their definitions in exact integers or
// double: scale factors (ties to even, saturation, shifts both ways),
// comparisons, thresholds, Porter-Duff types, deinterlacing; check orders
// and agreement of every variant with the generic one.
#include <algorithm>
#include <cmath>
#include <functional>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class PixelArith : public zt::VariantTest {};
using Call = std::function<Status(const uint8_t*, int, const uint8_t*, int, uint8_t*, int, ImageSize)>;

// Functions of two sources or one (with or without a constant after it) as
// Calls, their trailing arguments bound.
template <class F, class... X>
Call two(F f, X... x) { return [=](auto... p) { return f(p..., x...); }; }
template <class F, class... X>
Call one(F f, X... x) { return [=](auto s, int ss, auto, int, auto... p) { return f(s, ss, p..., x...); }; }
template <class F, class C, class... X>
Call oneC(F f, C c, X... x) { return [=](auto s, int ss, auto, int, auto... p) { return f(s, ss, c, p..., x...); }; }

// r 2^-sf, ties to even, saturated to 0..255.
int scaled(int r, int sf) { return int(std::clamp(std::nearbyint(std::ldexp(double(r), -sf)), 0.0, 255.0)); }

// call on random guarded images (extremes and small values favoured) of
// channels-byte pixels; each destination byte must be ref(a, b, alpha of a,
// alpha of b, byte index within the pixel, a above, a below) (edge rows
// standing in beyond the ROI).
template <class Ref>
void expectPixels(Call call, Ref ref, int channels = 1) {
    std::mt19937 rng(5);
    const uint8_t favoured[] = {0, 1, 2, 3, 5, 7, 127, 128, 254, 255};
    for (ImageSize roi : {ImageSize{1, 1}, ImageSize{37, 3}, ImageSize{64, 2}}) {
        const int w = roi.width * channels, h = roi.height, c = channels - 1;
        zt::GuardedImage<uint8_t> a(w, h, 0, 3), b(w, h, 1, 0, zt::Guard::Before), d(w, h, 0, 5);
        auto value = [&](int, int) { return rng() % 3 ? int(rng() % 256) : favoured[rng() % 10]; };
        a.fill(value), b.fill(value);
        ASSERT_EQ(call(a.roi(), a.step(), b.roi(), b.step(), d.roi(), d.step(), roi), StatusOk);
        EXPECT_TRUE(d.outsideIntact());
        for (int y = 0, last = h - 1; y <= last; ++y)
            for (int x = 0, k = 0; x < w; ++x, k = x % channels)
                ASSERT_EQ(*d.at(x, y), ref(*a.at(x, y), *b.at(x, y), *a.at(x - k + c, y), *b.at(x - k + c, y), k,
                                           *a.at(x, std::max(y - 1, 0)), *a.at(x, std::min(y + 1, last))))
                    << x << "," << y;
    }
}

TEST_P(PixelArith, ElementwiseOperationsFollowTheirDefinitions) {
    const auto& z = this->z();
    uint8_t ties[] = {5, 7}, ones[] = {1, 1}, out[2];  // ties go to the even neighbour: 2.5 -> 2, 3.5 -> 4
    EXPECT_TRUE(z.zoriMul_8u_C1RSfs(ties, 2, ones, 2, out, 2, {2, 1}, 1) == StatusOk && out[0] == 2 && out[1] == 4);
    for (int sf : {0, 1, 2, 3, 7, 8, 9, 15, 16, 17, 40, -1, -3, -7, -8, -9, -200}) {
        expectPixels(two(z.zoriAdd_8u_C1RSfs, sf), [sf](int a, int b, auto...) { return scaled(a + b, sf); });
        expectPixels(two(z.zoriSub_8u_C1RSfs, sf), [sf](int a, int b, auto...) { return scaled(b - a, sf); });
        expectPixels(two(z.zoriMul_8u_C1RSfs, sf), [sf](int a, int b, auto...) { return scaled(a * b, sf); });
        for (int v : {0, 1, 3, 200, 255})
            expectPixels(oneC(z.zoriMulC_8u_C1RSfs, uint8_t(v), sf), [&](int a, auto...) { return scaled(a * v, sf); });
    }
    expectPixels(two(z.zoriAbsDiff_8u_C1R), [](int a, int b, auto...) { return std::abs(a - b); });
    expectPixels(two(z.zoriAnd_8u_C1R), [](int a, int b, auto...) { return a & b; });
    expectPixels(two(z.zoriOr_8u_C1R), [](int a, int b, auto...) { return a | b; });
    expectPixels(two(z.zoriXor_8u_C1R), [](int a, int b, auto...) { return a ^ b; });
    expectPixels(one(z.zoriNot_8u_C1R), [](int a, auto...) { return 255 - a; });
    const std::function<bool(int, int)> rel[] = {std::less<int>(), std::less_equal<int>(), std::equal_to<int>(),
                                                 std::greater_equal<int>(), std::greater<int>()};
    for (int t : {0, 7, 128, 255}) {
        expectPixels(one(z.zoriThreshold_8u_C1R, t, CmpLess), [t](int a, auto...) { return std::max(a, t); });
        expectPixels(one(z.zoriThreshold_8u_C1R, t, CmpGreater), [t](int a, auto...) { return std::min(a, t); });
        expectPixels(one(z.zoriThreshold_LTValGTVal_8u_C1R, uint8_t(t / 2), uint8_t(9), uint8_t(t), uint8_t(250)),
                     [t](int a, auto...) { return a < t / 2 ? 9 : a > t ? 250 : a; });
        for (int op = CmpLess; op <= CmpGreater; ++op) {
            expectPixels(two(z.zoriCompare_8u_C1R, op), [&](int a, int b, auto...) { return rel[op](a, b) ? 255 : 0; });
            expectPixels(oneC(z.zoriCompareC_8u_C1R, t, op), [&](int a, auto...) { return rel[op](a, t) ? 255 : 0; });
        }
    }
    for (uint32_t c : {0, 1, 128, 171, 255, 256})  // deinterlacing: weighted neighbour rows (heights 1 to 3)
        expectPixels(one(z.zoriDeinterlaceFilterTriangle_8u_C1R, c, 0u), [c](int m, int, int, int, int, int up, int down) {
            return int(std::floor(((up + down) * (256.0 - c) / 2 + m * c + 128) / 256));
        });
}

// colour = cA aA FA + cB aB FB, rounded half up (never exactly halfway).
int composed(int type, int cA, int cB, int a, int b) {
    const double aA = a / 255.0, aB = b / 255.0;
    const double fa[] = {1, aB, 1 - aB, aB, 1 - aB, 1}, fb[] = {1 - aA, 0, 0, 1 - aA, 1 - aA, 1};
    return std::min(255, int(std::floor(cA * aA * fa[type] + cB * aB * fb[type] + 0.5)));
}

TEST_P(PixelArith, AlphaCompositionFollowsPorterDuff) {
    for (int type = AlphaOver; type <= AlphaPlus; ++type) {
        expectPixels(two(z().zoriAlphaComp_8u_AC4R, type), [type](int cA, int cB, int a, int b, int k, auto...) {
            return k == 3 ? composed(type, 255, 255, a, b) : composed(type, cA, cB, a, b);  // alpha: a colour of 255
        }, 4);
        for (int a : {0, 1, 128, 254, 255})
            for (int b : {0, 77, 255})
                expectPixels([&](const uint8_t* s1, int s1s, const uint8_t* s2, int s2s, auto... p) {
                    return z().zoriAlphaCompC_8u_C1R(s1, s1s, uint8_t(a), s2, s2s, uint8_t(b), p..., type);
                }, [&](int cA, int cB, auto...) { return composed(type, cA, cB, a, b); });
    }
}

TEST_P(PixelArith, FloatArithmetic) {
    const auto v = zt::randomFloats(3 * 37, 9);
    float d[36];
    for (auto fn : {z().zoriAdd_32f_C1R, z().zoriSub_32f_C1R, z().zoriMul_32f_C1R}) {
        ASSERT_EQ(fn(v.data(), 12, v.data() + 37, 16, d, 8, {2, 18}), StatusOk);  // rows of 3, 4 and 2 floats
        for (int i = 0; i < 36; ++i) {
            const float a = v[3 * (i / 2) + i % 2], b = v[37 + 4 * (i / 2) + i % 2];
            volatile float rounded = fn == z().zoriAdd_32f_C1R ? a + b : fn == z().zoriSub_32f_C1R ? b - a : a * b;
            EXPECT_EQ(d[i], float(rounded));  // (stored: an x87 register would keep more bits)
        }
    }
}

TEST_P(PixelArith, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t a[32] = {}, b[32] = {}, d[32] = {};
    const ImageSize roi{4, 2}, none{1, 0};
    const auto w = zt::watch(d, 32);
    auto twoSources = [&](auto fn, auto good) {  // the function's own argument (if any) last
        zt::expectChecks(fn, good, {w}, zt::eachNull(), zt::bad(StatusBadSize, zt::arg<6>(ImageSize{0, 1})),
                         zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusBadStep, zt::arg<5>(-4)),
                         zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<6>(none)),
                         zt::bad(StatusBadSize, zt::arg<6>(none), zt::arg<3>(0)));
    };
    twoSources(z.zoriAdd_8u_C1RSfs, std::make_tuple(a, 4, b, 4, d, 4, roi, 0));
    twoSources(z.zoriAnd_8u_C1R, std::make_tuple(a, 4, b, 4, d, 4, roi));
    twoSources(z.zoriAdd_32f_C1R, std::make_tuple((float*)a, 16, (float*)b, 16, (float*)d, 16, ImageSize{2, 2}));
    const Status arg = StatusBadArgument;
    zt::expectChecks(z.zoriCompare_8u_C1R, {a, 4, b, 4, d, 4, roi, CmpEq}, {w}, zt::bad(arg, zt::arg<7>(5)),
                     zt::bad(arg, zt::arg<7>(-1)), zt::bad(StatusBadStep, zt::arg<3>(0), zt::arg<7>(9)));
    zt::expectChecks(z.zoriAlphaComp_8u_AC4R, {a, 16, b, 16, d, 16, roi, AlphaPlus}, {w}, zt::bad(arg, zt::arg<7>(6)),
                     zt::bad(StatusBadSize, zt::arg<6>(none), zt::arg<7>(6)));
    zt::expectChecks(z.zoriAlphaCompC_8u_C1R, {a, 4, 1, b, 4, 2, d, 4, roi, AlphaIn}, {w}, zt::eachNull(),
                     zt::bad(arg, zt::arg<9>(-1)));
    zt::expectChecks(z.zoriThreshold_8u_C1R, {a, 4, d, 4, roi, 9, CmpLess}, {w}, zt::eachNull(),
                     zt::bad(arg, zt::arg<6>(CmpEq)), zt::bad(StatusBadStep, zt::arg<3>(0), zt::arg<6>(1)));
    zt::expectChecks(z.zoriThreshold_LTValGTVal_8u_C1R, {a, 4, d, 4, roi, 9, 0, 9, 0}, {w},
                     zt::bad(arg, zt::arg<5>(10)), zt::bad(StatusBadSize, zt::arg<4>(none), zt::arg<5>(10)));
    zt::expectChecks(z.zoriDeinterlaceFilterTriangle_8u_C1R, {a, 4, d, 4, roi, 256u, 0u}, {w}, zt::eachNull(),
                     zt::bad(arg, zt::arg<5>(257u)), zt::bad(arg, zt::arg<6>(1u)),
                     zt::bad(StatusBadStep, zt::arg<1>(-1), zt::arg<5>(300u)));
    // a constant of 0 or a scale above 16 writes zeros without reading the source (here: a guard page)
    zt::GuardedBuffer unreadable(1);
    for (int sf : {17, 0}) {
        std::fill(d, d + 32, 1);
        ASSERT_EQ(z.zoriMulC_8u_C1RSfs(unreadable.data() + 1, 4, sf ? 9 : 0, d, 4, roi, sf), StatusOk);
        EXPECT_EQ(std::count(d, d + 8, 0), 8);
    }
}

TEST_P(PixelArith, VariantsAgree) {
    for (int k = 0; k < 5 + 6; ++k)  // the last six: AlphaComp of each type
        zt::agreesWithGeneric(variant(), [&](const zt::Api& z, zt::Case& c) {
            const int w = c.roi().width * (k < 5 ? 1 : 4), h = c.roi().height;
            const auto s1 = c.inImage<uint8_t>(w, h), s2 = c.inImage<uint8_t>(w, h), d = c.outImage<uint8_t>(w, h);
            const Call runs[] = {two(z.zoriAdd_8u_C1RSfs, 1), two(z.zoriSub_8u_C1RSfs, -2), two(z.zoriMul_8u_C1RSfs, 5),
                                 one(z.zoriDeinterlaceFilterTriangle_8u_C1R, 129u, 0u),
                                 [&](auto s1, int s1s, auto s2, int s2s, auto... p) {
                                     return z.zoriAlphaCompC_8u_C1R(s1, s1s, 100, s2, s2s, 200, p..., AlphaXor);
                                 },
                                 two(z.zoriAlphaComp_8u_AC4R, k - 5)};
            return runs[std::min(k, 5)](s1.p, s1.step, s2.p, s2.step, d.p, d.step, c.roi());
        });
}

}  // namespace

ZT_ALL_VARIANTS(PixelArith);
