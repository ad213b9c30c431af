// Mirrors on every variant: the not-in-place forms against a direct index
// map, the in-place forms against the pairwise exchange (alpha stays put).
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/variants.h"

namespace {

using zpt::contents;
using zpt::image;

class Mirror : public zt::VariantTest {};

// Source pixel of destination pixel (x, y).
void sourceOf(int flip, ImageSize r, int x, int y, int& sx, int& sy) {
    sx = flip == 0 ? x : r.width - 1 - x;
    sy = flip == 1 ? y : r.height - 1 - y;
}

template <class T, int C, class F>
void checkCopy(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    for (int flip : {0, 1, 2})
        for (ImageSize roi : zpt::shapes())
            for (zpt::Layout l : zpt::layouts()) {
                auto src = image<T>(roi, C, l, rng);
                auto dst = image<T>(roi, C, {l.padElems + 1, !l.bordered}, rng);
                ASSERT_EQ(fn(src->roi(), src->step(), dst->roi(), dst->step(), roi, flip), StatusOk);
                for (int y = 0; y < roi.height; ++y)
                    for (int x = 0; x < roi.width; ++x) {
                        int sx, sy;
                        sourceOf(flip, roi, x, y, sx, sy);
                        for (int k = 0; k < C; ++k)
                            ASSERT_EQ(*dst->at(x * C + k, y), *src->at(sx * C + k, sy))
                                << "axis " << flip << ", " << roi.width << "x" << roi.height;
                    }
                ASSERT_TRUE(dst->outsideIntact());
            }
}

// In place: the colour elements of (x, y) come from its mirror image; with
// alpha (C = 4) the fourth element stays where it was.
template <class T, int C, class F>
void checkInPlace(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    for (int flip : {0, 1, 2})
        for (ImageSize roi : zpt::shapes())
            for (zpt::Layout l : zpt::layouts()) {
                auto img = image<T>(roi, C, l, rng);
                const std::vector<T> before = contents(*img);
                ASSERT_EQ(fn(img->roi(), img->step(), roi, flip), StatusOk);
                const std::vector<T> after = contents(*img);
                for (int y = 0; y < roi.height; ++y)
                    for (int x = 0; x < roi.width; ++x) {
                        int sx, sy;
                        sourceOf(flip, roi, x, y, sx, sy);
                        for (int k = 0; k < C; ++k) {
                            const size_t at = (size_t(y) * roi.width + x) * C + k;
                            const size_t from = (size_t(sy) * roi.width + sx) * C + k;
                            ASSERT_EQ(after[at], before[k == 3 ? at : from])
                                << "axis " << flip << ", " << roi.width << "x" << roi.height;
                        }
                    }
                ASSERT_TRUE(img->outsideIntact());
            }
}

TEST_P(Mirror, NotInPlace) {
    checkCopy<uint8_t, 3>(z().zoriMirror_8u_C3R, 1);
    checkCopy<int32_t, 3>(z().zoriMirror_32s_C3R, 2);
}

TEST_P(Mirror, InPlace) {
    checkInPlace<uint8_t, 1>(z().zoriMirror_8u_C1IR, 3);
    checkInPlace<uint8_t, 3>(z().zoriMirror_8u_C3IR, 4);
    checkInPlace<uint8_t, 4>(z().zoriMirror_8u_AC4IR, 5);
    checkInPlace<uint16_t, 1>(z().zoriMirror_16u_C1IR, 6);
    checkInPlace<uint16_t, 3>(z().zoriMirror_16u_C3IR, 7);
    checkInPlace<uint16_t, 4>(z().zoriMirror_16u_AC4IR, 8);
}

TEST_P(Mirror, AlphaStaysAtItsPosition) {
    uint8_t px[8] = {1, 2, 3, 100, 4, 5, 6, 200};
    ASSERT_EQ(z().zoriMirror_8u_AC4IR(px, 8, {2, 1}, 1), StatusOk);
    const uint8_t expect[8] = {4, 5, 6, 100, 1, 2, 3, 200};
    EXPECT_EQ(0, std::memcmp(px, expect, 8));
}

TEST_P(Mirror, SmallCasesAndInPlaceMatchesCopy) {
    uint8_t one[3] = {7, 8, 9};
    for (int flip : {0, 1, 2}) {
        ASSERT_EQ(z().zoriMirror_8u_C3IR(one, 3, {1, 1}, flip), StatusOk);
        EXPECT_EQ(one[0] + one[1] * 10 + one[2] * 100, 987);
    }
    uint8_t row[5] = {1, 2, 3, 4, 5};
    ASSERT_EQ(z().zoriMirror_8u_C1IR(row, 5, {5, 1}, 0), StatusOk);  // height 1, axis 0: unchanged
    EXPECT_EQ(row[0] * 10000 + row[1] * 1000 + row[2] * 100 + row[3] * 10 + row[4], 12345);
    uint8_t sq[27], copy[27];
    for (int i = 0; i < 27; ++i) sq[i] = uint8_t(i);
    ASSERT_EQ(z().zoriMirror_8u_C3R(sq, 9, copy, 9, {3, 3}, 2), StatusOk);
    ASSERT_EQ(z().zoriMirror_8u_C3IR(sq, 9, {3, 3}, 2), StatusOk);
    EXPECT_EQ(0, std::memcmp(sq, copy, 27));
    EXPECT_EQ(sq[12], 12);  // the centre pixel stays
    EXPECT_EQ(sq[13], 13);
    EXPECT_EQ(sq[14], 14);
}

TEST_P(Mirror, NegativeStepWalksUpwards) {
    std::vector<uint16_t> a(4 * 6), b(4 * 6);
    for (size_t i = 0; i < a.size(); ++i) a[i] = uint16_t(i * 1000 + 7);
    std::vector<uint16_t> ref = a;
    // the image seen bottom row first: axis 0 over it is axis 0 over the whole
    ASSERT_EQ(z().zoriMirror_16u_C3IR(a.data() + 18, -12, {2, 4}, 2), StatusOk);
    ASSERT_EQ(zt::api(0).zoriMirror_16u_C3IR(ref.data() + 18, -12, {2, 4}, 2), StatusOk);
    EXPECT_EQ(a, ref);
    EXPECT_EQ(a[0], 1000 * 21 + 7);  // pixel (0,0) now holds the last pixel's first element
}

TEST_P(Mirror, CheckOrder) {
    uint8_t a[32] = {}, b[32] = {};
    const auto& z = this->z();
    EXPECT_EQ(z.zoriMirror_8u_C1IR(nullptr, 4, {2, 2}, 3), StatusNullPointer);
    EXPECT_EQ(z.zoriMirror_8u_C1IR(a, 4, {0, 5}, 3), StatusBadSize);
    EXPECT_EQ(z.zoriMirror_8u_C1IR(a, 4, {2, 2}, 3), StatusBadFlip);
    EXPECT_EQ(z.zoriMirror_16u_AC4IR(reinterpret_cast<uint16_t*>(a), 8, {1, 1}, -1), StatusBadFlip);
    EXPECT_EQ(z.zoriMirror_8u_C3R(a, 3, nullptr, 3, {0, 0}, 1), StatusNullPointer);
    EXPECT_EQ(z.zoriMirror_32s_C3R(reinterpret_cast<int32_t*>(a), 12, reinterpret_cast<int32_t*>(b), 12, {1, 0}, 1),
              StatusBadSize);
    for (int i = 0; i < 32; ++i) a[i] = uint8_t(i + 1);
    EXPECT_EQ(z.zoriMirror_8u_C3R(a, 6, b, 6, {2, 2}, 3), StatusBadFlip);
    for (uint8_t x : b) ASSERT_EQ(x, 0);
    // no step is checked: a zero step with axis 1 mirrors the one row it sees
    EXPECT_EQ(z.zoriMirror_8u_C3R(a, 0, b, 6, {2, 2}, 1), StatusOk);
    const uint8_t expect[12] = {4, 5, 6, 1, 2, 3, 4, 5, 6, 1, 2, 3};
    EXPECT_EQ(0, std::memcmp(b, expect, 12));
}

ZT_ALL_VARIANTS(Mirror);

}  // namespace
