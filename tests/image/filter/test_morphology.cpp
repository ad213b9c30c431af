// In-place morphology: results against the defining maximum or minimum over
// the mask, read from a copy of the whole image (so no result row may be
// read back), border pixels never written; masks, anchors and check order.
#include <cmath>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Morphology : public zt::VariantTest {};

// Runs fn in place on a random w x h image inside a random border of b
// pixels (against the guard page) and compares every pixel, border
// included, with the maximum (or minimum) over the mask's nonzero taps (the
// full 3x3 unless given) of a copy, taken in row order from the first; a
// float NaN is never picked, but one in the first tap stays.
template <class T, class F>
::testing::AssertionResult matches(F fn, bool max, int w, int h, std::mt19937& rng, int b = 1,
                                   const std::vector<uint8_t>& mask = std::vector<uint8_t>(9, 1), ImageSize m = {3, 3},
                                   ImagePoint a = {1, 1}) {
    zt::GuardedImage<T> img(w, h, b, 0, h % 2 ? zt::Guard::After : zt::Guard::Before);
    img.fill([&](int, int) { return sizeof(T) == 1 ? T(rng()) : rng() % 16 ? T(float(int(rng() % 2000) - 1000) * 0.37f) : T(NAN); });
    std::vector<T> all;
    for (int y = -b; y < h + b; ++y) all.insert(all.end(), img.at(-b, y), img.at(w + b, y));
    const auto at = [&](int x, int y) { return all[size_t(y + b) * (w + 2 * b) + x + b]; };
    if (fn(img.roi(), img.step(), ImageSize{w, h}) != StatusOk) return ::testing::AssertionFailure() << "status";
    for (int y = -b; y < h + b; ++y)
        for (int x = -b; x < w + b; ++x) {
            T v = at(x, y);
            for (int k = 0, first = 1; x >= 0 && x < w && y >= 0 && y < h && k < m.width * m.height; ++k) {
                const T p = at(x - a.x + k % m.width, y - a.y + k / m.width);
                if (mask[k] && (first || (max ? p > v : p < v))) v = p, first = 0;
            }
            if (std::memcmp(img.at(x, y), &v, sizeof v) != 0)
                return ::testing::AssertionFailure() << w << "x" << h << " at " << x << "," << y;
        }
    return ::testing::AssertionSuccess();
}

// Widths around the register widths, every row count up to 7; masks of up
// to 5 x 5 with zero taps (and nonzero ones other than 1), any anchor.
TEST_P(Morphology, MatchesTheDefinition) {
    std::mt19937 rng(31);
    for (int trial = 0; trial < 60; ++trial) {
        const int w = trial < 28 ? std::vector<int>{1, 2, 15, 16, 17, 45, 50}[trial % 7] : 1 + int(rng() % 40),
                  h = trial < 28 ? 1 + trial / 7 * 2 : 1 + int(rng() % 8);
        EXPECT_TRUE(matches<uint8_t>(z().zoriDilate3x3_8u_C1IR, true, w, h, rng));
        EXPECT_TRUE(matches<uint8_t>(z().zoriErode3x3_8u_C1IR, false, w, h, rng));
        EXPECT_TRUE(matches<float>(z().zoriErode3x3_32f_C1IR, false, w, h, rng));
        const ImageSize m{1 + int(rng() % 5), 1 + int(rng() % 5)};
        const ImagePoint a{int(rng() % m.width), int(rng() % m.height)};
        std::vector<uint8_t> mask(size_t(m.width * m.height));
        for (auto& v : mask) v = rng() % 3 == 0 ? 0 : uint8_t(rng() % 255 + 1);
        mask[size_t(rng() % mask.size())] = 1;
        const auto fn = trial % 2 ? z().zoriDilate_8u_C1IR : z().zoriErode_8u_C1IR;
        const auto masked = [&](uint8_t* p, int step, ImageSize r) { return fn(p, step, r, mask.data(), m, a); };
        EXPECT_TRUE(matches<uint8_t>(masked, trial % 2, w, h, rng, 4, mask, m, a)) << trial;
    }
}

// Pointers, step, size, then the mask's size, content and anchor; the step
// must hold the row and the mask's overhang (counted in elements).
TEST_P(Morphology, ChecksInOrder) {
    uint8_t img[64] = {};
    float fimg[64] = {};
    const uint8_t zero[9] = {}, one[9] = {0, 0, 0, 0, 1, 0, 0, 0, 0};
    const std::vector<zt::Watch> w{zt::watch(img, sizeof img)}, wf{zt::watch(fimg, sizeof fimg)};
    zt::expectChecks(z().zoriDilate3x3_8u_C1IR, {img + 9, 6, ImageSize{4, 2}}, w, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusStepBelowRow, zt::arg<1>(5)), zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<2>(ImageSize{0, 0})));
    zt::expectChecks(z().zoriErode3x3_32f_C1IR, {fimg + 7, 24, ImageSize{4, 2}}, wf, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusStepBelowRow, zt::arg<1>(23)));
    zt::expectChecks(z().zoriErode_8u_C1IR, {img + 9, 6, ImageSize{4, 2}, one, ImageSize{3, 3}, ImagePoint{1, 1}}, w,
                     zt::eachNull(), zt::badRoi<2>(), zt::bad(StatusBadAnchor, zt::arg<5>(ImagePoint{3, 1})),
                     zt::bad(StatusBadAnchor, zt::arg<5>(ImagePoint{1, -1})), zt::bad(StatusStepBelowRow, zt::arg<1>(5)),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0, 0}), zt::arg<4>(ImageSize{0, 3})),
                     zt::bad(StatusBadMaskSize, zt::arg<3>(zero), zt::arg<4>(ImageSize{3, 0})),
                     zt::bad(StatusZeroMask, zt::arg<3>(zero), zt::arg<5>(ImagePoint{9, 9})));
}

}  // namespace

ZT_ALL_VARIANTS(Morphology);
