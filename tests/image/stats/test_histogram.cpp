// Range histograms against direct counts of levels[k] <= v < levels[k + 1]
// (8-bit level clamping and the overlapping bins of non-increasing float
// levels come to exactly that), variant agreement and the check orders.
#include <cmath>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Histogram : public zt::VariantTest {};

// Bins of the elements first, first + stride, ... of every row.
template <class T, class L>
void expectCounts(const zt::GuardedImage<T>& img, int first, int stride, const std::vector<L>& lv, const int32_t* hist) {
    for (size_t k = 0; k + 1 < lv.size(); ++k) {
        int32_t n = 0;
        for (int y = 0; y < img.height(); ++y)
            for (int x = first; x < img.width(); x += stride) n += lv[k] <= *img.at(x, y) && *img.at(x, y) < lv[k + 1];
        ASSERT_EQ(hist[k], n) << "bin " << k;
    }
}

TEST_P(Histogram, CountsMatchTheDefinition) {
    std::mt19937 rng(variant());
    zt::GuardedImage<uint8_t> img(3 * 1400, 3, 0, 2);  // a long row of zeros fills every lane counter
    img.fill([&](int, int y) { return y == 1 ? 0 : rng() % 5 ? rng() : 255; });
    zt::GuardedImage<float> f(36, 4);  // sixteenths; every 7th column NaN or a level of the first set
    f.fill([&](int x, int) { return x % 7 ? float(int(rng() % 96) - 32) / 16 : x == 7 ? std::nanf("") : (x - 14) / 14.f; });
    std::vector<int32_t> h(40), h3[3] = {h, h, h}, odd{-5, 3, 3, 2, 100, 300, 1000, 7}, many(33);
    std::vector<float> fine(33);  // 8u: past 8 boundaries, the full histogram; 32f: bisection past 30 levels
    for (int k = 0; k < 33; ++k) many[k] = 8 * k - 5, fine[k] = float(many[k]) / 8;
    for (const std::vector<int32_t>& lv : {std::vector<int32_t>{0, 256}, {0, 255}, {-10, 0}, odd, many}) {
        ASSERT_EQ(z().zoriHistogramRange_8u_C1R(img.roi(), img.step(), {4200, 3}, h.data(), lv.data(), int(lv.size())), 0);
        expectCounts(img, 0, 1, lv, h.data());
        int32_t* hp[3] = {h3[0].data(), h3[1].data(), h3[2].data()};
        const int n[3] = {int(lv.size()), 8, int(lv.size())}, *lp[3] = {lv.data(), odd.data(), lv.data()};
        ASSERT_EQ(z().zoriHistogramRange_8u_C3R(img.roi(), img.step(), {1400, 3}, hp, lp, n), StatusOk);
        for (int c = 0; c < 3; ++c) expectCounts(img, c, 3, c == 1 ? odd : lv, hp[c]);
    }
    for (const std::vector<float>& lv : {std::vector<float>{-1, 0, 0.5f, 1.5f}, {2, 1, 0, 1.5f, -3}, fine}) {
        ASSERT_EQ(z().zoriHistogramRange_32f_C1R(f.roi(), f.step(), {36, 4}, h.data(), lv.data(), int(lv.size())), 0);
        expectCounts(f, 0, 1, lv, h.data());
    }
}

TEST_P(Histogram, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const auto img = c.inImage<uint8_t>(3 * c.roi().width, c.roi().height);
        const auto f = c.inImage<float>(c.roi().width, c.roi().height);
        const int32_t levels[5] = {-1, 7, 100, 101, 256}, *lp[3] = {levels, levels + 1, levels + 2}, n[3] = {3, 4, 3};
        const float lf[6] = {-900, -100, 0, 3, 250, 999};
        int32_t *h = c.out<int32_t>(16), *hp[3] = {h + 4, h + 6, h + 9};
        return z.zoriHistogramRange_8u_C1R(img.p, img.step, {3 * c.roi().width, c.roi().height}, h, levels, 5) |
               z.zoriHistogramRange_8u_C3R(img.p, img.step, c.roi(), hp, lp, n) |
               z.zoriHistogramRange_32f_C1R(f.p, f.step, c.roi(), h + 11, lf, 6);
    });
}

TEST_P(Histogram, ChecksInOrder) {
    uint8_t s[16] = {};
    const float f[4] = {}, lf[3] = {0, 1, 2};
    int32_t h[8] = {}, lv[3] = {0, 1, 2}, *hp[3] = {h, h + 2, h + 4}, *nullHist[3] = {h, nullptr, h};
    const int n[3] = {3, 3, 3}, one[3] = {3, 1, 3}, *lp[3] = {lv, lv, lv};
    const std::vector<zt::Watch> out{zt::watch(h, sizeof h)};
    using zt::arg, zt::bad;
    const auto size = bad(StatusBadSize, arg<2>(ImageSize{0, 1}), arg<1>(0), arg<5>(1));
    const auto step = bad(StatusBadStep, arg<1>(0), arg<5>(1));
    zt::expectChecks(z().zoriHistogramRange_8u_C1R, {s, 4, {2, 2}, h, lv, 3}, out, zt::eachNull(), size, step,
                     bad(StatusBadLevelCount, arg<5>(1)));
    zt::expectChecks(z().zoriHistogramRange_32f_C1R, {f, 8, {2, 2}, h, lf, 3}, out, zt::eachNull(), size, step,
                     bad(StatusBadLevelCount, arg<5>(-1)));
    zt::expectChecks(z().zoriHistogramRange_8u_C3R, {s, 6, {2, 2}, hp, lp, n}, out, zt::eachNull(),
                     bad(StatusNullPointer, arg<3>(nullHist), arg<1>(0)), bad(StatusBadStep, arg<1>(-6)),
                     bad(StatusBadLevelCount, arg<5>(one), arg<2>(ImageSize{0, 0})),
                     bad(StatusBadSize, arg<2>(ImageSize{1, 0}), arg<1>(0)));
}

}  // namespace

ZT_ALL_VARIANTS(Histogram);
