// Rank filters: medians of every odd mask (fixed shapes and the general
// path), maximum and minimum with even masks, anchors, checks.
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class RankFilter : public zt::VariantTest {};

// A source holding exactly the neighbourhoods of a ROI of w x 3 (ax
// columns to the left, mW - 1 - ax to the right, ay rows above, the rest
// below), rows packed, against a guard page on one side; the filter's
// output against the sorted neighbourhood's element pick(count) for every
// pixel, nothing written outside the destination's ROI.
template <class T, class F, class Pick>
::testing::AssertionResult matchesSortedHoods(F fn, Pick pick, ImageSize m, ImagePoint a, int w, int range,
                                              std::mt19937& rng) {
    const ImageSize roi{w, 3};
    const int rowLen = w + m.width - 1, rows = roi.height + m.height - 1;
    zt::GuardedBuffer buf(sizeof(T) * size_t(rowLen) * rows, w % 2 ? zt::Guard::After : zt::Guard::Before);
    T* s = buf.as<T>();
    for (int i = 0; i < rowLen * rows; ++i) s[i] = T(range ? int(rng() % range) - range / 2 : int(rng()));
    zt::GuardedImage<T> d(w, roi.height, 0, 3 * int(sizeof(T)));  // padded rows
    const T* origin = s + size_t(a.y) * rowLen + a.x;
    if (fn(origin, rowLen * int(sizeof(T)), d.roi(), d.step(), roi, m, a) != StatusOk)
        return ::testing::AssertionFailure() << "status";
    for (int y = 0; y < roi.height; ++y)
        for (int x = 0; x < w; ++x) {
            std::vector<T> v;
            for (int j = 0; j < m.height; ++j)
                for (int i = 0; i < m.width; ++i) v.push_back(origin[ptrdiff_t(y - a.y + j) * rowLen + x - a.x + i]);
            std::sort(v.begin(), v.end());
            if (*d.at(x, y) != v[pick(v.size())])
                return ::testing::AssertionFailure() << m.width << "x" << m.height << ", w " << w << " at " << x << "," << y;
        }
    return d.outsideIntact() ? ::testing::AssertionSuccess() : ::testing::AssertionFailure() << "wrote outside";
}

TEST_P(RankFilter, MatchSortedNeighbourhoods) {
    std::mt19937 rng(21);
    const auto middle = [](size_t n) { return n / 2; };
    const ImageSize odd[] = {{1, 1}, {3, 3}, {5, 5}, {3, 1}, {5, 1}, {1, 3}, {1, 5}, {7, 7}, {3, 5}, {9, 1}, {1, 7}};
    for (ImageSize m : odd)
        for (int w : {1, 15, 16, 35})
            for (int c = 0; c < 2; ++c) {  // few distinct values in half the cases: many ties
                const ImagePoint a = c ? ImagePoint{m.width / 2, m.height / 2} : ImagePoint{m.width - 1, 0};
                EXPECT_TRUE(matchesSortedHoods<uint8_t>(z().zoriFilterMedian_8u_C1R, middle, m, a, w, c ? 256 : 5, rng));
                EXPECT_TRUE(matchesSortedHoods<int16_t>(z().zoriFilterMedian_16s_C1R, middle, m, a, w, c ? 0 : 5, rng));
            }
    const ImageSize any[] = {{1, 1}, {3, 3}, {2, 2}, {4, 3}, {1, 4}, {6, 1}, {5, 5}};
    for (ImageSize m : any)
        for (int w : {1, 16, 37}) {
            const ImagePoint a{m.width - 1 - (w % m.width), m.height / 2};
            EXPECT_TRUE(matchesSortedHoods<uint8_t>(z().zoriFilterMax_8u_C1R, [](size_t n) { return n - 1; }, m, a, w, 256, rng));
            EXPECT_TRUE(matchesSortedHoods<uint8_t>(z().zoriFilterMin_8u_C1R, [](size_t) { return size_t(0); }, m, a, w, 256, rng));
        }
}

// Pointers, size, steps, then the mask (medians: odd sides only) and the
// anchor inside it.
TEST_P(RankFilter, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[64] = {}, d[64] = {};
    int16_t s16[64] = {}, d16[64] = {};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)}, w16{zt::watch(d16, sizeof d16)};
    for (auto fn : {z.zoriFilterMedian_8u_C1R, z.zoriFilterMax_8u_C1R, z.zoriFilterMin_8u_C1R})
        zt::expectChecks(fn, {s + 9, 8, d, 8, ImageSize{2, 2}, ImageSize{3, 3}, ImagePoint{1, 1}}, w, zt::eachNull(),
                         zt::badRoi<4>(), zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusBadStep, zt::arg<3>(-8)),
                         zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{0, 3})),
                         zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{3, 0})),
                         zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{0, -1})),
                         zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 0})),
                         zt::bad(StatusBadSize, zt::arg<1>(0), zt::arg<4>(ImageSize{2, 0})),
                         zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<5>(ImageSize{0, 0})),
                         zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{0, 3}), zt::arg<6>(ImagePoint{9, 9})));
    EXPECT_EQ(z.zoriFilterMedian_8u_C1R(s + 16, 8, d, 8, {2, 2}, {4, 3}, {0, 0}), StatusBadMaskSize);
    EXPECT_EQ(z.zoriFilterMax_8u_C1R(s + 16, 8, d, 8, {2, 2}, {4, 3}, {0, 0}), StatusOk);
    zt::expectChecks(z.zoriFilterMedian_16s_C1R, {s16 + 9, 16, d16, 8, ImageSize{2, 2}, ImageSize{3, 3}, ImagePoint{1, 1}},
                     w16, zt::eachNull(), zt::badRoi<4>(), zt::bad(StatusBadStep, zt::arg<3>(-8)),
                     zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{3, 2})),
                     zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{-1, 1})));
}

}  // namespace

ZT_ALL_VARIANTS(RankFilter);
