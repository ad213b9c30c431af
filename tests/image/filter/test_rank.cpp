// Rank filters: medians of every odd mask (fixed shapes and the general
// path), maximum and minimum with even masks, anchors, checks.
#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class RankFilter : public zt::VariantTest {};

// Source holding exactly the neighbourhoods of the ROI: ax columns to the
// left, mW - 1 - ax to the right, ay rows above, mH - 1 - ay below; rows
// packed, flush against a guard page on one side.
template <class T>
struct RankSource {
    RankSource(ImageSize roi, ImageSize m, ImagePoint a, zt::Guard g)
        : rowLen(roi.width + m.width - 1), rows(roi.height + m.height - 1),
          buf(sizeof(T) * size_t(rowLen) * size_t(rows), g), a(a) {}
    int step() const { return rowLen * int(sizeof(T)); }
    T* base() const { return buf.as<T>(); }
    T* roi() const { return base() + size_t(a.y) * rowLen + a.x; }
    T at(int x, int y) const { return roi()[ptrdiff_t(y) * rowLen + x]; }
    int rowLen, rows;
    zt::GuardedBuffer buf;
    ImagePoint a;
};

template <class T>
std::vector<T> hood(const RankSource<T>& s, int x, int y, ImageSize m, ImagePoint a) {
    std::vector<T> v;
    for (int j = 0; j < m.height; ++j)
        for (int i = 0; i < m.width; ++i) v.push_back(s.at(x - a.x + i, y - a.y + j));
    std::sort(v.begin(), v.end());
    return v;
}

TEST_P(RankFilter, MediansMatchReference) {
    std::mt19937 rng(21 + variant());
    const ImageSize masks[] = {{1, 1}, {3, 3}, {5, 5}, {3, 1}, {5, 1}, {1, 3}, {1, 5}, {7, 7}, {3, 5}, {9, 1}, {1, 7}};
    for (ImageSize m : masks)
        for (int w : {1, 15, 16, 35})
            for (int anchorCase = 0; anchorCase < 2; ++anchorCase) {
                const ImagePoint a = anchorCase ? ImagePoint{m.width / 2, m.height / 2}
                                                : ImagePoint{m.width - 1, 0};
                const ImageSize roi{w, 3};
                // few distinct values in half the cases: many ties
                const int range = anchorCase ? 256 : 5;
                RankSource<uint8_t> s8(roi, m, a, anchorCase ? zt::Guard::After : zt::Guard::Before);
                for (int i = 0; i < s8.rowLen * s8.rows; ++i) s8.base()[i] = uint8_t(rng() % range);
                zt::GuardedImage<uint8_t> d8(w, roi.height, 0, 3);
                ASSERT_EQ(z().zoriFilterMedian_8u_C1R(s8.roi(), s8.step(), d8.roi(), d8.step(), roi, m, a), StatusOk);
                EXPECT_TRUE(d8.outsideIntact());
                RankSource<int16_t> s16(roi, m, a, anchorCase ? zt::Guard::Before : zt::Guard::After);
                for (int i = 0; i < s16.rowLen * s16.rows; ++i)
                    s16.base()[i] = int16_t(anchorCase ? int(rng()) : int(rng() % 5) - 2);
                zt::GuardedImage<int16_t> d16(w, roi.height);
                ASSERT_EQ(z().zoriFilterMedian_16s_C1R(s16.roi(), s16.step(), d16.roi(), d16.step(), roi, m, a), StatusOk);
                EXPECT_TRUE(d16.outsideIntact());
                for (int y = 0; y < roi.height; ++y)
                    for (int x = 0; x < w; ++x) {
                        const auto v8 = hood(s8, x, y, m, a);
                        ASSERT_EQ(*d8.at(x, y), v8[v8.size() / 2]) << m.width << "x" << m.height << " w " << w;
                        const auto v16 = hood(s16, x, y, m, a);
                        ASSERT_EQ(*d16.at(x, y), v16[v16.size() / 2]) << m.width << "x" << m.height;
                    }
            }
}

TEST_P(RankFilter, MaxMinMatchReference) {
    std::mt19937 rng(22 + variant());
    const ImageSize masks[] = {{1, 1}, {3, 3}, {2, 2}, {4, 3}, {1, 4}, {6, 1}, {5, 5}};
    for (ImageSize m : masks)
        for (int w : {1, 16, 37}) {
            const ImagePoint a{m.width - 1 - (w % m.width), m.height / 2};
            const ImageSize roi{w, 4};
            RankSource<uint8_t> s(roi, m, a, w % 2 ? zt::Guard::After : zt::Guard::Before);
            for (int i = 0; i < s.rowLen * s.rows; ++i) s.base()[i] = uint8_t(rng());
            zt::GuardedImage<uint8_t> dmax(w, roi.height), dmin(w, roi.height, 0, 5);
            ASSERT_EQ(z().zoriFilterMax_8u_C1R(s.roi(), s.step(), dmax.roi(), dmax.step(), roi, m, a), StatusOk);
            ASSERT_EQ(z().zoriFilterMin_8u_C1R(s.roi(), s.step(), dmin.roi(), dmin.step(), roi, m, a), StatusOk);
            EXPECT_TRUE(dmax.outsideIntact());
            EXPECT_TRUE(dmin.outsideIntact());
            for (int y = 0; y < roi.height; ++y)
                for (int x = 0; x < w; ++x) {
                    const auto v = hood(s, x, y, m, a);
                    ASSERT_EQ(*dmax.at(x, y), v.back());
                    ASSERT_EQ(*dmin.at(x, y), v.front());
                }
        }
}

TEST_P(RankFilter, SinglePixel) {
    const auto& z = this->z();
    zt::GuardedImage<uint8_t> src(7, 7, 1);
    src.fill([](int x, int y) { return x == 3 && y == 3 ? 200 : 0; });
    zt::GuardedImage<uint8_t> d(7, 7);
    const ImageSize roi{7, 7}, m{3, 3};
    ASSERT_EQ(z.zoriFilterMedian_8u_C1R(src.roi(), src.step(), d.roi(), d.step(), roi, m, {1, 1}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*d.at(x, y), 0);
    ASSERT_EQ(z.zoriFilterMax_8u_C1R(src.roi(), src.step(), d.roi(), d.step(), roi, m, {1, 1}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*d.at(x, y), (x >= 2 && x <= 4 && y >= 2 && y <= 4) ? 200 : 0);
    // anchor (0, 0): the neighbourhood lies right of and below the pixel
    ASSERT_EQ(z.zoriFilterMax_8u_C1R(src.roi(), src.step(), d.roi(), d.step(), {6, 6}, m, {0, 0}), StatusOk);
    EXPECT_EQ(*d.at(1, 1), 200);
    EXPECT_EQ(*d.at(3, 3), 200);
    EXPECT_EQ(*d.at(4, 4), 0);
    ASSERT_EQ(z.zoriFilterMin_8u_C1R(src.roi(), src.step(), d.roi(), d.step(), roi, m, {1, 1}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*d.at(x, y), 0);
    // 1..9 in any order: 5
    const uint8_t nine[9] = {9, 2, 7, 4, 1, 8, 3, 6, 5};
    uint8_t out = 0;
    ASSERT_EQ(z.zoriFilterMedian_8u_C1R(nine + 4, 3, &out, 1, {1, 1}, m, {1, 1}), StatusOk);
    EXPECT_EQ(out, 5);
}

TEST_P(RankFilter, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[64] = {}, d[64] = {};
    int16_t s16[64] = {}, d16[64] = {};
    const ImageSize roi{2, 2};
    for (auto fn : {z.zoriFilterMedian_8u_C1R, z.zoriFilterMax_8u_C1R, z.zoriFilterMin_8u_C1R}) {
        EXPECT_EQ(fn(nullptr, 0, d, 0, {0, 0}, {0, 0}, {9, 9}), StatusNullPointer);
        EXPECT_EQ(fn(s, 0, d, 0, {2, 0}, {0, 0}, {9, 9}), StatusBadSize);
        EXPECT_EQ(fn(s, 0, d, 8, roi, {0, 0}, {9, 9}), StatusBadStep);
        EXPECT_EQ(fn(s, 8, d, 8, roi, {0, 3}, {9, 9}), StatusBadMaskSize);
        EXPECT_EQ(fn(s, 8, d, 8, roi, {3, 3}, {3, 0}), StatusBadAnchor);
        EXPECT_EQ(fn(s, 8, d, 8, roi, {3, 3}, {0, -1}), StatusBadAnchor);
        const Status even = fn(s + 16, 8, d, 8, roi, {4, 3}, {0, 0});
        EXPECT_EQ(even, fn == z.zoriFilterMedian_8u_C1R ? StatusBadMaskSize : StatusOk);
    }
    EXPECT_EQ(z.zoriFilterMedian_16s_C1R(s16, 16, nullptr, 8, roi, {3, 3}, {1, 1}), StatusNullPointer);
    EXPECT_EQ(z.zoriFilterMedian_16s_C1R(s16, 16, d16, -8, roi, {3, 3}, {1, 1}), StatusBadStep);
    EXPECT_EQ(z.zoriFilterMedian_16s_C1R(s16, 16, d16, 8, roi, {3, 2}, {9, 9}), StatusBadMaskSize);
    EXPECT_EQ(z.zoriFilterMedian_16s_C1R(s16, 16, d16, 8, roi, {3, 3}, {-1, 1}), StatusBadAnchor);
    for (int16_t v : d16) EXPECT_EQ(v, 0);
}

}  // namespace

ZT_ALL_VARIANTS(RankFilter);
