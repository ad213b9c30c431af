// In-place morphology: results against an out-of-place reference, the ramp
// that shows no result row is read back, masks, anchors and check order.
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Morphology : public zt::VariantTest {};

// Reference over a copy of the whole buffer (border included).
template <class T, bool Max>
std::vector<T> reference(const zt::GuardedImage<T>& img, const std::vector<uint8_t>& mask,
                         ImageSize m, ImagePoint a) {
    const int w = img.width(), h = img.height();
    std::vector<T> out(size_t(w) * h);
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            bool first = true;
            T v{};
            for (int j = 0; j < m.height; ++j)
                for (int i = 0; i < m.width; ++i) {
                    if (!mask[size_t(j) * m.width + i]) continue;
                    const T p = *img.at(x - a.x + i, y - a.y + j);
                    if (first || (Max ? p > v : p < v)) v = p;
                    first = false;
                }
            out[size_t(y) * w + x] = v;
        }
    return out;
}

TEST_P(Morphology, ThreeByThreeMatchesReference) {
    std::mt19937 rng(31 + variant());
    const std::vector<uint8_t> full(9, 1);
    for (int w : {1, 2, 15, 16, 17, 50})
        for (int h : {1, 2, 3, 7}) {
            zt::GuardedImage<uint8_t> a(w, h, 1, 0, h % 2 ? zt::Guard::After : zt::Guard::Before);
            a.fill([&](int, int) { return rng(); });
            const auto eMax = reference<uint8_t, true>(a, full, {3, 3}, {1, 1});
            ASSERT_EQ(z().zoriDilate3x3_8u_C1IR(a.roi(), a.step(), {w, h}), StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) ASSERT_EQ(*a.at(x, y), eMax[size_t(y) * w + x]) << w << "x" << h;
            a.fill([&](int, int) { return rng(); });
            const auto eMin2 = reference<uint8_t, false>(a, full, {3, 3}, {1, 1});
            ASSERT_EQ(z().zoriErode3x3_8u_C1IR(a.roi(), a.step(), {w, h}), StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) ASSERT_EQ(*a.at(x, y), eMin2[size_t(y) * w + x]);
            zt::GuardedImage<float> f(w, h, 1, 0, h % 2 ? zt::Guard::Before : zt::Guard::After);
            f.fill([&](int, int) { return float(int(rng() % 2000) - 1000) * 0.37f; });
            const auto eF = reference<float, false>(f, full, {3, 3}, {1, 1});
            ASSERT_EQ(z().zoriErode3x3_32f_C1IR(f.roi(), f.step(), {w, h}), StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) ASSERT_EQ(*f.at(x, y), eF[size_t(y) * w + x]);
        }
}

// Border pixels are read, never written.
TEST_P(Morphology, WritesOnlyTheRoi) {
    zt::GuardedImage<uint8_t> a(19, 5, 1, 3);
    a.markOutside();
    ASSERT_EQ(z().zoriDilate3x3_8u_C1IR(a.roi(), a.step(), {19, 5}), StatusOk);
    EXPECT_TRUE(a.outsideIntact());
    const uint8_t mask[6] = {1, 0, 1, 1, 1, 0};
    ASSERT_EQ(z().zoriErode_8u_C1IR(a.roi(), a.step(), {19, 5}, mask, {3, 2}, {1, 1}), StatusOk);
    EXPECT_TRUE(a.outsideIntact());
}

TEST_P(Morphology, RampShowsNoResultIsReadBack) {
    for (int w : {4, 16, 33}) {
        const int h = 9;
        zt::GuardedImage<uint8_t> a(w, h, 1);
        a.fill([](int, int y) { return y + 1; });  // border row above holds 0, below h + 1
        ASSERT_EQ(z().zoriDilate3x3_8u_C1IR(a.roi(), a.step(), {w, h}), StatusOk);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) ASSERT_EQ(*a.at(x, y), y + 2);
        // a mask reaching three rows down, anchor row 0: every row takes row y + 3
        zt::GuardedImage<uint8_t> b(w, h, 3);
        b.fill([](int, int y) { return y + 10; });
        const uint8_t column[4] = {0, 1, 0, 1};  // rows y + 1 and y + 3
        ASSERT_EQ(z().zoriDilate_8u_C1IR(b.roi(), b.step(), {w, h}, column, {1, 4}, {0, 0}), StatusOk);
        for (int y = 0; y < h; ++y) ASSERT_EQ(*b.at(w - 1, y), y + 13);
        // and upward with the anchor at the bottom: rows y - 2 and y
        b.fill([](int, int y) { return 100 - y; });
        ASSERT_EQ(z().zoriDilate_8u_C1IR(b.roi(), b.step(), {w, h}, column, {1, 4}, {0, 3}), StatusOk);
        for (int y = 0; y < h; ++y) ASSERT_EQ(*b.at(0, y), 100 - (y - 2));
    }
}

TEST_P(Morphology, MaskedMatchesReference) {
    std::mt19937 rng(32 + variant());
    for (int trial = 0; trial < 20; ++trial) {
        const ImageSize m{1 + int(rng() % 5), 1 + int(rng() % 5)};
        const ImagePoint a{int(rng() % m.width), int(rng() % m.height)};
        std::vector<uint8_t> mask(size_t(m.width * m.height));
        for (auto& v : mask) v = rng() % 3 == 0 ? 0 : uint8_t(rng() % 255 + 1);
        mask[size_t(rng() % mask.size())] = 1;
        const int w = 1 + int(rng() % 40), h = 1 + int(rng() % 8);
        const bool dilate = trial % 2;
        zt::GuardedImage<uint8_t> img(w, h, 4);
        img.fill([&](int, int) { return rng(); });
        const auto e = dilate ? reference<uint8_t, true>(img, mask, m, a) : reference<uint8_t, false>(img, mask, m, a);
        auto fn = dilate ? z().zoriDilate_8u_C1IR : z().zoriErode_8u_C1IR;
        ASSERT_EQ(fn(img.roi(), img.step(), {w, h}, mask.data(), m, a), StatusOk);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) ASSERT_EQ(*img.at(x, y), e[size_t(y) * w + x]) << trial;
    }
}

TEST_P(Morphology, SinglePixelAndIdentity) {
    zt::GuardedImage<uint8_t> a(7, 7, 1);
    a.fill([](int x, int y) { return x == 3 && y == 3 ? 200 : 0; });
    ASSERT_EQ(z().zoriDilate3x3_8u_C1IR(a.roi(), a.step(), {7, 7}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*a.at(x, y), (x >= 2 && x <= 4 && y >= 2 && y <= 4) ? 200 : 0);
    a.fill([](int x, int y) { return x == 3 && y == 3 ? 200 : 0; });
    ASSERT_EQ(z().zoriErode3x3_8u_C1IR(a.roi(), a.step(), {7, 7}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*a.at(x, y), 0);
    // one nonzero byte at the anchor leaves the image unchanged
    a.fill([](int x, int y) { return x * 7 + y * 13; });
    const uint8_t mask[9] = {0, 0, 0, 0, 0, 9, 0, 0, 0};
    ASSERT_EQ(z().zoriErode_8u_C1IR(a.roi(), a.step(), {7, 7}, mask, {3, 3}, {2, 1}), StatusOk);
    for (int y = 0; y < 7; ++y)
        for (int x = 0; x < 7; ++x) EXPECT_EQ(*a.at(x, y), x * 7 + y * 13);
    // height 1 writes only row 0
    zt::GuardedImage<uint8_t> b(5, 1, 1);
    b.fill([](int x, int y) { return 10 * (y + 2) + x; });
    ASSERT_EQ(z().zoriErode3x3_8u_C1IR(b.roi(), b.step(), {5, 1}), StatusOk);
    EXPECT_EQ(*b.at(2, 0), 11);
    EXPECT_EQ(*b.at(2, 1), 32);
    EXPECT_EQ(*b.at(2, -1), 12);
}

TEST_P(Morphology, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t img[64] = {};
    float fimg[64] = {};
    const uint8_t zero[9] = {}, one[9] = {0, 0, 0, 0, 1, 0, 0, 0, 0};
    EXPECT_EQ(z.zoriDilate3x3_8u_C1IR(nullptr, 0, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriDilate3x3_8u_C1IR(img, 0, {0, 0}), StatusBadStep);
    EXPECT_EQ(z.zoriErode3x3_8u_C1IR(img, 5, {0, 1}), StatusBadSize);
    EXPECT_EQ(z.zoriDilate3x3_8u_C1IR(img + 9, 5, {4, 2}), StatusStepBelowRow);
    EXPECT_EQ(z.zoriDilate3x3_8u_C1IR(img + 9, 6, {4, 2}), StatusOk);
    EXPECT_EQ(z.zoriErode3x3_32f_C1IR(fimg + 7, 23, {4, 2}), StatusStepBelowRow);
    EXPECT_EQ(z.zoriErode3x3_32f_C1IR(fimg + 7, 24, {4, 2}), StatusOk);
    EXPECT_EQ(z.zoriErode3x3_32f_C1IR(fimg, -4, {4, 2}), StatusBadStep);
    for (auto fn : {z.zoriDilate_8u_C1IR, z.zoriErode_8u_C1IR}) {
        EXPECT_EQ(fn(img, 0, {0, 0}, nullptr, {0, 0}, {9, 9}), StatusNullPointer);
        EXPECT_EQ(fn(img, 0, {0, 0}, zero, {0, 0}, {9, 9}), StatusBadStep);
        EXPECT_EQ(fn(img, 8, {0, 0}, zero, {0, 0}, {9, 9}), StatusBadSize);
        EXPECT_EQ(fn(img, 8, {4, 2}, zero, {0, 3}, {9, 9}), StatusBadMaskSize);
        EXPECT_EQ(fn(img, 8, {4, 2}, zero, {3, 3}, {9, 9}), StatusZeroMask);
        EXPECT_EQ(fn(img, 8, {4, 2}, one, {3, 3}, {3, 1}), StatusBadAnchor);
        EXPECT_EQ(fn(img, 5, {4, 2}, one, {3, 3}, {1, 1}), StatusStepBelowRow);
        EXPECT_EQ(fn(img + 9, 6, {4, 2}, one, {3, 3}, {1, 1}), StatusOk);
    }
}

}  // namespace

ZT_ALL_VARIANTS(Morphology);
