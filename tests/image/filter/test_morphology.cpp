// In-place morphology: results against the defining maximum or minimum over
// the mask, read from a copy of the whole image (so no result row may be
// read back), border pixels never written; masks, anchors and check order.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Morphology : public zt::VariantTest {};

// Runs fn on a random image of w x h with a border of b (just what the
// mask needs: against the guard page), against the maximum (or minimum)
// over the mask's nonzero taps of a copy, taken in row order from the
// first; a float NaN is never picked, but one in the first tap stays.
template <class T, class F>
::testing::AssertionResult matchesDefinition(F fn, bool max, int w, int h, const std::vector<uint8_t>& mask,
                                             ImageSize m, ImagePoint a, std::mt19937& rng, int b = 4) {
    zt::GuardedImage<T> img(w, h, b, 0, h % 2 ? zt::Guard::After : zt::Guard::Before);
    img.fill([&](int, int) {
        return sizeof(T) == 1 ? T(rng()) : rng() % 16 ? T(float(int(rng() % 2000) - 1000) * 0.37f) : T(NAN);
    });
    std::vector<T> all;
    for (int y = -b; y < h + b; ++y) all.insert(all.end(), img.at(-b, y), img.at(w + b, y));
    const auto at = [&](int x, int y) { return all[size_t(y + b) * (w + 2 * b) + x + b]; };
    if (fn(img, ImageSize{w, h}) != StatusOk) return ::testing::AssertionFailure() << "status";
    for (int y = -b; y < h + b; ++y)
        for (int x = -b; x < w + b; ++x) {
            T v = at(x, y);
            if (x >= 0 && x < w && y >= 0 && y < h) {
                bool first = true;
                for (int j = 0; j < m.height; ++j)
                    for (int i = 0; i < m.width; ++i) {
                        const T p = at(x - a.x + i, y - a.y + j);
                        if (mask[size_t(j) * m.width + i] && (first || (max ? p > v : p < v))) v = p, first = false;
                    }
            }
            if (std::memcmp(img.at(x, y), &v, sizeof v) != 0)
                return ::testing::AssertionFailure() << w << "x" << h << " at " << x << "," << y;
        }
    return ::testing::AssertionSuccess();
}

// Widths around the register widths, every row count up to 7; masks of up
// to 5 x 5 with zero taps and any anchor.
TEST_P(Morphology, MatchesTheDefinition) {
    std::mt19937 rng(31);
    const auto& z = this->z();
    const std::vector<uint8_t> full(9, 1);
    const auto fixed = [](auto fn) { return [fn](auto& i, ImageSize r) { return fn(i.roi(), i.step(), r); }; };
    for (int trial = 0; trial < 60; ++trial) {
        const int w = trial < 28 ? std::vector<int>{1, 2, 15, 16, 17, 45, 50}[trial % 7] : 1 + int(rng() % 40);
        const int h = trial < 28 ? 1 + trial / 7 * 2 : 1 + int(rng() % 8);
        EXPECT_TRUE(matchesDefinition<uint8_t>(fixed(z.zoriDilate3x3_8u_C1IR), true, w, h, full, {3, 3}, {1, 1}, rng, 1));
        EXPECT_TRUE(matchesDefinition<uint8_t>(fixed(z.zoriErode3x3_8u_C1IR), false, w, h, full, {3, 3}, {1, 1}, rng, 1));
        EXPECT_TRUE(matchesDefinition<float>(fixed(z.zoriErode3x3_32f_C1IR), false, w, h, full, {3, 3}, {1, 1}, rng, 1));
        const ImageSize m{1 + int(rng() % 5), 1 + int(rng() % 5)};
        const ImagePoint a{int(rng() % m.width), int(rng() % m.height)};
        std::vector<uint8_t> mask(size_t(m.width * m.height));
        for (auto& v : mask) v = rng() % 3 == 0 ? 0 : uint8_t(rng() % 255 + 1);
        mask[size_t(rng() % mask.size())] = 1;
        const auto fn = trial % 2 ? z.zoriDilate_8u_C1IR : z.zoriErode_8u_C1IR;
        EXPECT_TRUE(matchesDefinition<uint8_t>([&](auto& i, ImageSize r) { return fn(i.roi(), i.step(), r, mask.data(), m, a); },
                                               trial % 2, w, h, mask, m, a, rng))
            << trial;
    }
}

// Pointers, step, size, then the mask's size, content and anchor; the step
// must hold the row and the mask's overhang.
TEST_P(Morphology, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t img[64] = {};
    float fimg[64] = {};
    const uint8_t zero[9] = {}, one[9] = {0, 0, 0, 0, 1, 0, 0, 0, 0};
    const std::vector<zt::Watch> w{zt::watch(img, sizeof img)}, wf{zt::watch(fimg, sizeof fimg)};
    zt::expectChecks(z.zoriDilate3x3_8u_C1IR, {img + 9, 6, ImageSize{4, 2}}, w, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusStepBelowRow, zt::arg<1>(5)),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<2>(ImageSize{0, 0})));
    zt::expectChecks(z.zoriErode3x3_32f_C1IR, {fimg + 7, 24, ImageSize{4, 2}}, wf, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusStepBelowRow, zt::arg<1>(23)));
    zt::expectChecks(z.zoriErode_8u_C1IR, {img + 9, 6, ImageSize{4, 2}, one, ImageSize{3, 3}, ImagePoint{1, 1}}, w,
                     zt::eachNull(), zt::badRoi<2>(), zt::bad(StatusBadMaskSize, zt::arg<4>(ImageSize{3, 0})),
                     zt::bad(StatusZeroMask, zt::arg<3>(zero)), zt::bad(StatusBadAnchor, zt::arg<5>(ImagePoint{3, 1})),
                     zt::bad(StatusBadAnchor, zt::arg<5>(ImagePoint{1, -1})), zt::bad(StatusStepBelowRow, zt::arg<1>(5)),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0, 0}), zt::arg<4>(ImageSize{0, 3})),
                     zt::bad(StatusBadMaskSize, zt::arg<3>(zero), zt::arg<4>(ImageSize{0, 3})),
                     zt::bad(StatusZeroMask, zt::arg<3>(zero), zt::arg<5>(ImagePoint{9, 9})));
}

}  // namespace

ZT_ALL_VARIANTS(Morphology);
