// Range histograms against direct counts of levels[k] <= v < levels[k + 1]
// (for 8-bit images and for float levels without NaN, clamping and the
// overlapping bins of non-increasing levels give exactly that), variant
// agreement and the check orders.
#include <limits>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Histogram : public zt::VariantTest {};

// Elements first, first + stride, ... of every row.
template <class T, class L>
void expectCounts(const zt::GuardedImage<T>& img, int first, int stride, const std::vector<L>& levels,
                  const int32_t* hist) {
    for (size_t k = 0; k + 1 < levels.size(); ++k) {
        int32_t n = 0;
        for (int y = 0; y < img.height(); ++y)
            for (int x = first; x < img.width(); x += stride) n += levels[k] <= *img.at(x, y) && *img.at(x, y) < levels[k + 1];
        ASSERT_EQ(hist[k], n) << "bin " << k;
    }
}

TEST_P(Histogram, CountsMatchTheDefinition) {
    std::mt19937 rng(variant());
    const std::vector<std::vector<int32_t>> levels8{{0, 256}, {0, 255}, {-10, 0}, {-5, 3, 3, 2, 100, 300, 1000, 7}};
    const std::vector<std::vector<float>> levelsF{{-1, 0, 0.5f, 2}, {2, 1, 0, 1.5f, -3}, std::vector<float>(40)};
    zt::GuardedImage<uint8_t> img(3 * 37, 5, 0, 2);
    img.fill([&](int, int) { return rng() % 5 ? rng() : 255; });
    zt::GuardedImage<float> f(29, 4);
    f.fill([&](int x, int) { return x % 7 ? float(int(rng() % 80) - 30) / 16 : x % 2 ? 2 : std::numeric_limits<float>::quiet_NaN(); });
    std::vector<int32_t> h(40), h3[3] = {h, h, h};
    for (const auto& lv : levels8) {
        ASSERT_EQ(z().zoriHistogramRange_8u_C1R(img.roi(), img.step(), {3 * 37, 5}, h.data(), lv.data(), int(lv.size())), 0);
        expectCounts(img, 0, 1, lv, h.data());
        int32_t* hp[3] = {h3[0].data(), h3[1].data(), h3[2].data()};
        const int32_t* lp[3] = {lv.data(), levels8[3].data(), lv.data()};
        const int n[3] = {int(lv.size()), 8, int(lv.size())};
        ASSERT_EQ(z().zoriHistogramRange_8u_C3R(img.roi(), img.step(), {37, 5}, hp, lp, n), StatusOk);
        for (int c = 0; c < 3; ++c) expectCounts(img, c, 3, c == 1 ? levels8[3] : lv, hp[c]);
    }
    std::vector<float> many = levelsF[2];
    for (int k = 0; k < 40; ++k) many[k] = float(k - 20) / 8;  // bisection past 30 levels
    for (const auto& lv : {levelsF[0], levelsF[1], many}) {
        ASSERT_EQ(z().zoriHistogramRange_32f_C1R(f.roi(), f.step(), {29, 4}, h.data(), lv.data(), int(lv.size())), 0);
        expectCounts(f, 0, 1, lv, h.data());
    }
}

TEST_P(Histogram, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const ImageSize r = c.roi();
        const auto img = c.inImage<uint8_t>(3 * r.width, r.height);
        const int32_t levels[5] = {-1, 7, 100, 101, 256}, *lp[3] = {levels, levels + 1, levels + 2};
        int32_t* h = c.out<int32_t>(12);
        int32_t* hp[3] = {h + 4, h + 6, h + 9};
        const int n[3] = {3, 4, 3};
        return z.zoriHistogramRange_8u_C1R(img.p, img.step, {3 * r.width, r.height}, h, levels, 5) |
               z.zoriHistogramRange_8u_C3R(img.p, img.step, r, hp, lp, n);
    });
}

TEST_P(Histogram, ChecksInOrder) {
    uint8_t s[16] = {};
    float f[4] = {};
    int32_t h[8] = {}, lv[3] = {0, 1, 2}, *hp[3] = {h, h + 2, h + 4};
    const int32_t* lp[3] = {lv, lv, lv};
    const int n[3] = {3, 3, 3}, one[3] = {3, 1, 3};
    const float lf[3] = {0, 1, 2};
    const std::vector<zt::Watch> out{zt::watch(h, sizeof h)};
    const auto size = zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0, 1}), zt::arg<1>(0), zt::arg<5>(1));
    const auto step = zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<5>(1));
    zt::expectChecks(z().zoriHistogramRange_8u_C1R, {s, 4, {2, 2}, h, lv, 3}, out, zt::eachNull(), size, step,
                     zt::bad(StatusBadLevelCount, zt::arg<5>(1)));
    zt::expectChecks(z().zoriHistogramRange_32f_C1R, {f, 8, {2, 2}, h, lf, 3}, out, zt::eachNull(), size, step,
                     zt::bad(StatusBadLevelCount, zt::arg<5>(-1)));
    int32_t* nullHist[3] = {h, nullptr, h};
    zt::expectChecks(z().zoriHistogramRange_8u_C3R, {s, 6, {2, 2}, hp, lp, n}, out, zt::eachNull(),
                     zt::bad(StatusNullPointer, zt::arg<3>(nullHist), zt::arg<1>(0)),
                     zt::bad(StatusBadLevelCount, zt::arg<5>(one), zt::arg<2>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{1, 0}), zt::arg<1>(0)), zt::bad(StatusBadStep, zt::arg<1>(-6)));
}

}  // namespace

ZT_ALL_VARIANTS(Histogram);
