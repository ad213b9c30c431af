// Copies, fills, channel layouts, channel order and replicated borders, on
// every variant, against plain loops written here.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

using zpt::contents;
using zpt::image;
using zpt::sameBits;

class Copy : public zt::VariantTest {};
class CopyLayout : public zt::VariantTest {};
class SetFill : public zt::VariantTest {};
class Swap : public zt::VariantTest {};
class Border : public zt::VariantTest {};

// Interleaved to interleaved: every destination pixel (stride DC) takes N
// elements from the source pixel (stride SC); its other elements stay.
template <class T, int SC, int DC, int N, class F>
void checkPick(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto src = image<T>(roi, SC, l, rng);
            auto dst = image<T>(roi, DC, {l.padElems + 1, !l.bordered}, rng);
            std::vector<T> expect = contents(*dst);
            const std::vector<T> s = contents(*src);
            // moved as bytes: a float assignment on x87 would quiet signalling NaNs
            for (int y = 0; y < roi.height; ++y)
                for (int x = 0; x < roi.width; ++x)
                    std::memcpy(&expect[(size_t(y) * roi.width + x) * DC], &s[(size_t(y) * roi.width + x) * SC],
                                N * sizeof(T));
            ASSERT_EQ(fn(src->roi(), src->step(), dst->roi(), dst->step(), roi), StatusOk);
            ASSERT_TRUE(sameBits(contents(*dst), expect)) << roi.width << "x" << roi.height;
            ASSERT_TRUE(dst->outsideIntact());
        }
    // rows packed on both sides (the one-long-row path)
    for (ImageSize roi : {ImageSize{7, 5}, ImageSize{33, 4}}) {
        auto src = image<T>(roi, SC, {0, false}, rng);
        auto dst = image<T>(roi, DC, {0, false}, rng);
        std::vector<T> expect = contents(*dst);
        const std::vector<T> s = contents(*src);
        for (size_t p = 0; p < size_t(roi.width) * roi.height; ++p)
            std::memcpy(&expect[p * DC], &s[p * SC], N * sizeof(T));
        ASSERT_EQ(fn(src->roi(), src->step(), dst->roi(), dst->step(), roi), StatusOk);
        ASSERT_TRUE(sameBits(contents(*dst), expect));
    }
}

TEST_P(Copy, PlainForms) {
    checkPick<uint8_t, 1, 1, 1>(z().zoriCopy_8u_C1R, 1);
    checkPick<int16_t, 1, 1, 1>(z().zoriCopy_16s_C1R, 2);
    checkPick<float, 1, 1, 1>(z().zoriCopy_32f_C1R, 3);  // random bits: NaNs move unchanged
    checkPick<uint8_t, 3, 3, 3>(z().zoriCopy_8u_C3R, 4);
    checkPick<int16_t, 3, 3, 3>(z().zoriCopy_16s_C3R, 5);
    checkPick<float, 3, 3, 3>(z().zoriCopy_32f_C3R, 6);
    checkPick<uint8_t, 4, 4, 4>(z().zoriCopy_8u_C4R, 7);
    checkPick<int16_t, 4, 4, 4>(z().zoriCopy_16s_C4R, 8);
}

TEST_P(Copy, ChannelInOutAndAlpha) {
    checkPick<uint8_t, 3, 1, 1>(z().zoriCopy_8u_C3C1R, 11);
    checkPick<int16_t, 3, 1, 1>(z().zoriCopy_16s_C3C1R, 12);
    checkPick<uint8_t, 4, 1, 1>(z().zoriCopy_8u_C4C1R, 13);
    checkPick<int16_t, 4, 1, 1>(z().zoriCopy_16s_C4C1R, 14);
    checkPick<uint8_t, 1, 3, 1>(z().zoriCopy_8u_C1C3R, 15);
    checkPick<int16_t, 1, 3, 1>(z().zoriCopy_16s_C1C3R, 16);
    checkPick<uint8_t, 1, 4, 1>(z().zoriCopy_8u_C1C4R, 17);
    checkPick<int16_t, 1, 4, 1>(z().zoriCopy_16s_C1C4R, 18);
    // alpha of the destination stays exactly as it was
    checkPick<uint8_t, 3, 4, 3>(z().zoriCopy_8u_C3AC4R, 19);
    checkPick<int16_t, 3, 4, 3>(z().zoriCopy_16s_C3AC4R, 20);
    checkPick<uint8_t, 4, 3, 3>(z().zoriCopy_8u_AC4C3R, 21);
    checkPick<int16_t, 4, 3, 3>(z().zoriCopy_16s_AC4C3R, 22);
}

TEST_P(Copy, ChannelChosenByPointer) {
    // the multi-channel side's pointer picks the channel: element 2 of each pixel
    const uint8_t src[2 * 3] = {1, 2, 3, 4, 5, 6};
    uint8_t one[2] = {0, 0};
    ASSERT_EQ(z().zoriCopy_8u_C3C1R(src + 2, 6, one, 2, {2, 1}), StatusOk);
    EXPECT_EQ(one[0], 3);
    EXPECT_EQ(one[1], 6);
    uint8_t four[8] = {0, 0, 0, 0, 0, 0, 0, 0};
    ASSERT_EQ(z().zoriCopy_8u_C1C4R(one, 2, four + 1, 8, {2, 1}), StatusOk);
    const uint8_t expect[8] = {0, 3, 0, 0, 0, 6, 0, 0};
    EXPECT_EQ(0, std::memcmp(four, expect, 8));
}

// The pointer on the multi-channel side addresses the last channel: the
// row then ends one element after it, against the guard page.
template <class T, int SC, class F>
void checkLastChannel(F fn) {
    std::mt19937 rng(SC * 10 + sizeof(T));
    for (ImageSize roi : zpt::shapes()) {
        auto src = image<T>(roi, SC, {0, false}, rng);
        auto dst = image<T>(roi, 1, {0, true}, rng);
        ASSERT_EQ(fn(src->roi() + SC - 1, src->step(), dst->roi(), dst->step(), roi), StatusOk);
        for (int y = 0; y < roi.height; ++y)
            for (int x = 0; x < roi.width; ++x) ASSERT_EQ(*dst->at(x, y), *src->at(x * SC + SC - 1, y));
    }
}

TEST_P(Copy, LastChannelAgainstTheGuard) {
    checkLastChannel<uint8_t, 3>(z().zoriCopy_8u_C3C1R);
    checkLastChannel<uint8_t, 4>(z().zoriCopy_8u_C4C1R);
    checkLastChannel<int16_t, 3>(z().zoriCopy_16s_C3C1R);
    checkLastChannel<int16_t, 4>(z().zoriCopy_16s_C4C1R);
}

TEST_P(Copy, DuplicateToThreeChannels) {
    std::mt19937 rng(30);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto src = image<uint8_t>(roi, 1, l, rng);
            auto dst = image<uint8_t>(roi, 3, l, rng);
            std::vector<uint8_t> expect;
            for (uint8_t v : contents(*src)) expect.insert(expect.end(), {v, v, v});
            ASSERT_EQ(z().zoriDup_8u_C1C3R(src->roi(), src->step(), dst->roi(), dst->step(), roi), StatusOk);
            ASSERT_EQ(contents(*dst), expect) << roi.width;
            ASSERT_TRUE(dst->outsideIntact());
        }
}

TEST_P(Copy, MaskedCopyAndSet) {
    std::mt19937 rng(31);
    for (ImageSize roi : zpt::shapes()) {
        zpt::Layout l{1, true};
        auto src = image<uint8_t>(roi, 3, l, rng);
        auto mask = image<uint8_t>(roi, 1, {2, false}, rng);
        for (int y = 0; y < roi.height; ++y)  // mostly zeros, some odd non-zero values
            for (int x = 0; x < roi.width; ++x) *mask->at(x, y) = rng() % 3 == 0 ? uint8_t(rng() | 1) : 0;
        auto dst = image<uint8_t>(roi, 3, {0, false}, rng);
        auto dst2 = image<uint8_t>(roi, 3, {0, false}, rng);
        std::vector<uint8_t> e1 = contents(*dst), e2 = contents(*dst2);
        const std::vector<uint8_t> s = contents(*src), m = contents(*mask);
        const uint8_t value[3] = {9, 99, 199};
        for (size_t p = 0; p < m.size(); ++p)
            if (m[p])
                for (int k = 0; k < 3; ++k) {
                    e1[3 * p + k] = s[3 * p + k];
                    e2[3 * p + k] = value[k];
                }
        ASSERT_EQ(z().zoriCopy_8u_C3MR(src->roi(), src->step(), dst->roi(), dst->step(), roi, mask->roi(),
                                       mask->step()),
                  StatusOk);
        ASSERT_EQ(z().zoriSet_8u_C3MR(value, dst2->roi(), dst2->step(), roi, mask->roi(), mask->step()), StatusOk);
        EXPECT_EQ(contents(*dst), e1);
        EXPECT_EQ(contents(*dst2), e2);
        EXPECT_TRUE(dst->outsideIntact() && dst2->outsideIntact() && mask->outsideIntact());
    }
}

// Planar <-> interleaved, all planes sharing one step.
template <class T, int C, class F>
void checkSplit(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto src = image<T>(roi, C, l, rng);
            std::unique_ptr<zt::GuardedImage<T>> planes[C];
            T* ptrs[C];
            for (int k = 0; k < C; ++k) {
                planes[k] = image<T>(roi, 1, {l.padElems + 2, l.bordered}, rng);
                ptrs[k] = planes[k]->roi();
            }
            ASSERT_EQ(fn(src->roi(), src->step(), ptrs, planes[0]->step(), roi), StatusOk);
            const std::vector<T> s = contents(*src);
            for (int k = 0; k < C; ++k) {
                std::vector<T> e;
                for (size_t p = k; p < s.size(); p += C) e.push_back(s[p]);
                ASSERT_EQ(contents(*planes[k]), e) << "plane " << k << ", width " << roi.width;
                ASSERT_TRUE(planes[k]->outsideIntact());
            }
        }
}

template <class T, int C, class F>
void checkMerge(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            std::unique_ptr<zt::GuardedImage<T>> planes[C];
            const T* ptrs[C];
            for (int k = 0; k < C; ++k) {
                planes[k] = image<T>(roi, 1, {l.padElems, !l.bordered}, rng);
                ptrs[k] = planes[k]->roi();
            }
            auto dst = image<T>(roi, C, l, rng);
            ASSERT_EQ(fn(ptrs, planes[0]->step(), dst->roi(), dst->step(), roi), StatusOk);
            std::vector<T> e(size_t(roi.width) * roi.height * C);
            for (int k = 0; k < C; ++k) {
                const std::vector<T> p = contents(*planes[k]);
                for (size_t i = 0; i < p.size(); ++i) e[i * C + k] = p[i];
            }
            ASSERT_EQ(contents(*dst), e) << roi.width;
            ASSERT_TRUE(dst->outsideIntact());
        }
}

TEST_P(CopyLayout, PlanarBothWays) {
    checkSplit<uint8_t, 3>(z().zoriCopy_8u_C3P3R, 40);
    checkSplit<int16_t, 3>(z().zoriCopy_16s_C3P3R, 41);
    checkSplit<uint8_t, 4>(z().zoriCopy_8u_C4P4R, 42);
    checkSplit<int16_t, 4>(z().zoriCopy_16s_C4P4R, 43);
    checkMerge<uint8_t, 3>(z().zoriCopy_8u_P3C3R, 44);
    checkMerge<int16_t, 3>(z().zoriCopy_16s_P3C3R, 45);
    checkMerge<uint8_t, 4>(z().zoriCopy_8u_P4C4R, 46);
}

TEST_P(CopyLayout, PackedPlanarAroundTheRowMergeCap) {
    // 8-bit three-channel images merge rows below 160000 interleaved bytes
    // and go row by row above; both give the same planes.
    std::mt19937 rng(47);
    for (ImageSize roi : {ImageSize{100, 533}, ImageSize{100, 534}, ImageSize{37, 3}}) {
        auto src = image<uint8_t>(roi, 3, {0, false}, rng);
        std::unique_ptr<zt::GuardedImage<uint8_t>> planes[3];
        uint8_t* ptrs[3];
        for (int k = 0; k < 3; ++k) {
            planes[k] = image<uint8_t>(roi, 1, {0, false}, rng);
            ptrs[k] = planes[k]->roi();
        }
        ASSERT_EQ(z().zoriCopy_8u_C3P3R(src->roi(), src->step(), ptrs, planes[0]->step(), roi), StatusOk);
        const std::vector<uint8_t> s = contents(*src);
        for (int k = 0; k < 3; ++k) {
            const std::vector<uint8_t> p = contents(*planes[k]);
            for (size_t i = 0; i < p.size(); ++i) ASSERT_EQ(p[i], s[3 * i + k]);
        }
        auto back = image<uint8_t>(roi, 3, {0, false}, rng);
        const uint8_t* cptrs[3] = {ptrs[0], ptrs[1], ptrs[2]};
        ASSERT_EQ(z().zoriCopy_8u_P3C3R(cptrs, planes[0]->step(), back->roi(), back->step(), roi), StatusOk);
        EXPECT_EQ(contents(*back), s);
    }
}

TEST_P(Copy, ChecksPointersThenSizesButNoSteps) {
    uint8_t a[64] = {}, b[64] = {};
    const auto& z = this->z();
    // a null pointer wins over a bad size; nothing is written either way
    EXPECT_EQ(z.zoriCopy_8u_C1R(nullptr, 4, b, 4, {0, 1}), StatusNullPointer);
    EXPECT_EQ(z.zoriCopy_8u_C3R(a, 4, nullptr, 4, {1, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriCopy_8u_C3MR(a, 4, b, 4, {0, 0}, nullptr, 4), StatusNullPointer);
    EXPECT_EQ(z.zoriSet_8u_C3R(nullptr, b, 4, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriSet_32f_C1R(1.0f, nullptr, 4, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriDup_8u_C1C3R(a, 4, nullptr, 4, {-1, 1}), StatusNullPointer);
    uint8_t* planes[3] = {b, nullptr, b + 8};
    EXPECT_EQ(z.zoriCopy_8u_C3P3R(a, 4, planes, 4, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriCopy_8u_C3P3R(a, 4, nullptr, 4, {1, 1}), StatusNullPointer);
    const uint8_t* cplanes[4] = {a, a, a, nullptr};
    EXPECT_EQ(z.zoriCopy_8u_P4C4R(cplanes, 4, b, 4, {1, 1}), StatusNullPointer);
    for (ImageSize bad : {ImageSize{0, 1}, ImageSize{1, 0}, ImageSize{-3, 2}}) {
        EXPECT_EQ(z.zoriCopy_8u_C1R(a, 4, b, 4, bad), StatusBadSize);
        EXPECT_EQ(z.zoriCopy_16s_C4C1R(reinterpret_cast<int16_t*>(a), 8, reinterpret_cast<int16_t*>(b), 8, bad),
                  StatusBadSize);
        EXPECT_EQ(z.zoriSet_16s_C1R(7, reinterpret_cast<int16_t*>(b), 8, bad), StatusBadSize);
        const uint8_t v[3] = {1, 2, 3};
        EXPECT_EQ(z.zoriSet_8u_C3MR(v, b, 8, bad, a, 8), StatusBadSize);
    }
    for (uint8_t x : b) ASSERT_EQ(x, 0);
    // steps are not checked: a zero source step repeats the first row...
    for (int i = 0; i < 64; ++i) a[i] = uint8_t(i);
    ASSERT_EQ(z.zoriCopy_8u_C1R(a, 0, b, 5, {5, 4}), StatusOk);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 5; ++x) ASSERT_EQ(b[y * 5 + x], x);
    // ...and a negative one walks upwards
    ASSERT_EQ(z.zoriCopy_8u_C3R(a + 48, -16, b, 6, {2, 4}), StatusOk);
    for (int y = 0; y < 4; ++y)
        for (int x = 0; x < 6; ++x) ASSERT_EQ(b[y * 6 + x], 48 - 16 * y + x);
    uint8_t* outPlanes[3] = {b, b + 20, b + 40};
    ASSERT_EQ(z.zoriCopy_8u_C3P3R(a + 30, -10, outPlanes, 4, {2, 3}), StatusOk);
    for (int y = 0; y < 3; ++y)
        for (int x = 0; x < 2; ++x)
            for (int k = 0; k < 3; ++k) ASSERT_EQ(outPlanes[k][y * 4 + x], 30 - 10 * y + 3 * x + k);
    // the fills take no step check either: a zero step fills one row again and again
    std::memset(b, 0, sizeof b);
    EXPECT_EQ(z.zoriSet_8u_C1R(3, b, 0, {5, 3}), StatusOk);
    EXPECT_EQ(z.zoriSet_32s_C1R(-2, reinterpret_cast<int32_t*>(b + 8), 0, {2, 2}), StatusOk);
    const uint8_t expectSet[16] = {3, 3, 3, 3, 3, 0, 0, 0, 0xFE, 0xFF, 0xFF, 0xFF, 0xFE, 0xFF, 0xFF, 0xFF};
    EXPECT_EQ(0, std::memcmp(b, expectSet, 16));
}

template <class T, class F>
void checkSetC1(F fn, T value) {
    std::mt19937 rng(50);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto dst = image<T>(roi, 1, l, rng);
            ASSERT_EQ(fn(value, dst->roi(), dst->step(), roi), StatusOk);
            ASSERT_TRUE(sameBits(contents(*dst), std::vector<T>(size_t(roi.width) * roi.height, value)));
            ASSERT_TRUE(dst->outsideIntact());
        }
}

template <class T, class F>
void checkSetC3(F fn, const T (&value)[3]) {
    std::mt19937 rng(51);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto dst = image<T>(roi, 3, l, rng);
            ASSERT_EQ(fn(value, dst->roi(), dst->step(), roi), StatusOk);
            std::vector<T> e;
            for (int i = 0; i < roi.width * roi.height; ++i) e.insert(e.end(), {value[0], value[1], value[2]});
            ASSERT_EQ(contents(*dst), e) << roi.width;
            ASSERT_TRUE(dst->outsideIntact());
        }
}

TEST_P(SetFill, EveryForm) {
    checkSetC1<uint8_t>(z().zoriSet_8u_C1R, 0xC3);
    checkSetC1<int16_t>(z().zoriSet_16s_C1R, -12345);
    checkSetC1<int32_t>(z().zoriSet_32s_C1R, -123456789);
    checkSetC1<float>(z().zoriSet_32f_C1R, -0.0f);
    checkSetC3<uint8_t>(z().zoriSet_8u_C3R, {1, 128, 255});
    checkSetC3<int16_t>(z().zoriSet_16s_C3R, {-32768, 1, 32767});
}

// Rows of several thousand bytes: the fill is written in pieces whose
// boundaries must keep the channel phase, row by row and as one long row.
TEST_P(SetFill, LongRows) {
    std::mt19937 rng(52);
    for (zpt::Layout l : {zpt::Layout{0, false}, zpt::Layout{5, true}}) {
        // three-channel fill: every pixel holds v, nothing outside the ROI moves
        auto setC3 = [&](auto set, ImageSize roi, const auto (&v)[3]) {
            using T = std::remove_const_t<std::remove_reference_t<decltype(v[0])>>;
            auto dst = image<T>(roi, 3, l, rng);
            ASSERT_EQ(set(v, dst->roi(), dst->step(), roi), StatusOk);
            const std::vector<T> c = contents(*dst);
            for (size_t i = 0; i < c.size(); ++i) ASSERT_EQ(c[i], v[i % 3]) << i;
            ASSERT_TRUE(dst->outsideIntact());
        };
        const uint8_t v8[3] = {7, 8, 9};
        setC3(z().zoriSet_8u_C3R, ImageSize{1500, 3}, v8);
        const int16_t v16[3] = {-2, 300, -32768};
        setC3(z().zoriSet_16s_C3R, ImageSize{1100, 2}, v16);
        {
            const ImageSize roi = {2001, 2};
            auto dst = image<int16_t>(roi, 1, l, rng);
            ASSERT_EQ(z().zoriSet_16s_C1R(-7, dst->roi(), dst->step(), roi), StatusOk);
            ASSERT_EQ(contents(*dst), std::vector<int16_t>(size_t(roi.width) * roi.height, -7));
            ASSERT_TRUE(dst->outsideIntact());
        }
        {
            const ImageSize roi = {1901, 2};
            auto dst = image<int32_t>(roi, 1, l, rng);
            ASSERT_EQ(z().zoriSet_32s_C1R(-123456, dst->roi(), dst->step(), roi), StatusOk);
            ASSERT_EQ(contents(*dst), std::vector<int32_t>(size_t(roi.width) * roi.height, -123456));
            ASSERT_TRUE(dst->outsideIntact());
        }
    }
}

TEST_P(SetFill, FloatIsStoredBitForBit) {
    // a quiet NaN with a payload survives any register it passes through
    uint32_t bits = 0x7FC12345u;
    float nan;
    std::memcpy(&nan, &bits, 4);
    uint32_t out[5] = {};
    ASSERT_EQ(z().zoriSet_32f_C1R(nan, reinterpret_cast<float*>(out), 20, {5, 1}), StatusOk);
    for (uint32_t w : out) EXPECT_EQ(w, bits);
}

// D[k] = S[o[k]] on three- or four-element pixels (alpha neither read nor written).
template <class T, int C, class F>
void checkSwap(F fn, uint32_t seed) {
    std::mt19937 rng(seed);
    const int orders[][3] = {{2, 1, 0}, {0, 1, 2}, {1, 2, 0}, {2, 0, 1}, {0, 0, 0}, {2, 2, 1}};
    for (const auto& o : orders)
        for (ImageSize roi : zpt::shapes())
            for (zpt::Layout l : zpt::layouts()) {
                auto src = image<T>(roi, C, l, rng);
                auto dst = image<T>(roi, C, {l.padElems, !l.bordered}, rng);
                std::vector<T> e = contents(*dst);
                const std::vector<T> s = contents(*src);
                for (size_t p = 0; p < s.size() / C; ++p)
                    for (int k = 0; k < 3; ++k) e[p * C + k] = s[p * C + o[k]];
                ASSERT_EQ(fn(src->roi(), src->step(), dst->roi(), dst->step(), roi, o), StatusOk);
                ASSERT_EQ(contents(*dst), e) << roi.width << " " << o[0] << o[1] << o[2];
                ASSERT_TRUE(dst->outsideIntact());
            }
}

TEST_P(Swap, Orders) {
    checkSwap<uint8_t, 3>(z().zoriSwapChannels_8u_C3R, 60);
    checkSwap<uint16_t, 3>(z().zoriSwapChannels_16u_C3R, 61);
    checkSwap<uint8_t, 4>(z().zoriSwapChannels_8u_AC4R, 62);
    checkSwap<uint16_t, 4>(z().zoriSwapChannels_16u_AC4R, 63);
}

TEST_P(Swap, InPlace) {
    std::mt19937 rng(64);
    const int orders[][3] = {{2, 1, 0}, {1, 2, 0}, {0, 0, 2}, {1, 1, 1}};
    for (const auto& o : orders)
        for (ImageSize roi : zpt::shapes())
            for (zpt::Layout l : zpt::layouts()) {
                auto img = image<uint8_t>(roi, 3, l, rng);
                std::vector<uint8_t> e = contents(*img);
                for (size_t p = 0; p < e.size(); p += 3) {
                    const uint8_t px[3] = {e[p], e[p + 1], e[p + 2]};
                    for (int k = 0; k < 3; ++k) e[p + k] = px[o[k]];
                }
                ASSERT_EQ(z().zoriSwapChannels_8u_C3IR(img->roi(), img->step(), roi, o), StatusOk);
                ASSERT_EQ(contents(*img), e) << roi.width;
                ASSERT_TRUE(img->outsideIntact());
            }
    uint8_t rgb[6] = {10, 20, 30, 40, 50, 60};
    const int bgr[3] = {2, 1, 0};
    ASSERT_EQ(z().zoriSwapChannels_8u_C3IR(rgb, 6, {2, 1}, bgr), StatusOk);
    const uint8_t expect[6] = {30, 20, 10, 60, 50, 40};
    EXPECT_EQ(0, std::memcmp(rgb, expect, 6));
}

TEST_P(Swap, CheckOrder) {
    uint8_t a[12] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12}, b[12] = {};
    const int ok[3] = {2, 1, 0}, three[3] = {0, 3, 1}, minus[3] = {-1, 0, 1};
    const auto& z = this->z();
    EXPECT_EQ(z.zoriSwapChannels_8u_C3R(a, 6, b, 6, {0, 0}, nullptr), StatusNullPointer);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3R(a, 0, b, 6, {0, 2}, three), StatusBadSize);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3R(a, 6, b, 0, {2, 2}, three), StatusBadStep);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3R(a, -6, b, 6, {2, 2}, ok), StatusBadStep);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3R(a, 6, b, 6, {2, 2}, three), StatusChannelOrder);
    EXPECT_EQ(z.zoriSwapChannels_16u_AC4R(reinterpret_cast<uint16_t*>(a), 8, reinterpret_cast<uint16_t*>(b), 8,
                                         {1, 1}, minus),
              StatusChannelOrder);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3IR(a, 0, {1, 1}, ok), StatusBadStep);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3IR(a, 6, {1, 1}, minus), StatusChannelOrder);
    EXPECT_EQ(z.zoriSwapChannels_8u_C3IR(nullptr, 0, {0, 1}, minus), StatusNullPointer);
    for (int i = 0; i < 12; ++i) {
        ASSERT_EQ(a[i], i + 1);
        ASSERT_EQ(b[i], 0);
    }
}

// Replicated border: reference built pixel by pixel from the nearest source pixel.
template <class T, int C, class F>
void checkBorder(F fn, ImageSize s, ImageSize d, int top, int left, std::mt19937& rng) {
    auto src = image<T>(s, C, {1, true}, rng);
    auto dst = image<T>(d, C, {2, false}, rng);
    std::vector<T> e;
    for (int y = 0; y < d.height; ++y)
        for (int x = 0; x < d.width; ++x) {
            const int sy = std::min(std::max(y - top, 0), s.height - 1);
            const int sx = std::min(std::max(x - left, 0), s.width - 1);
            for (int k = 0; k < C; ++k) e.push_back(*src->at(sx * C + k, sy));
        }
    ASSERT_EQ(fn(src->roi(), src->step(), s, dst->roi(), dst->step(), d, top, left), StatusOk);
    ASSERT_EQ(contents(*dst), e) << s.width << "x" << s.height << " in " << d.width << "x" << d.height << " at "
                                 << left << "," << top;
    ASSERT_TRUE(dst->outsideIntact());
}

TEST_P(Border, Replicates) {
    std::mt19937 rng(70);
    struct Case { ImageSize s, d; int top, left; };
    const Case cases[] = {{{5, 4}, {5, 4}, 0, 0},   {{5, 4}, {6, 4}, 0, 0},  {{1, 1}, {7, 5}, 2, 3},
                          {{17, 3}, {40, 9}, 3, 20}, {{3, 2}, {3, 6}, 4, 0}, {{4, 4}, {9, 4}, 0, 5},
                          {{33, 2}, {35, 3}, 1, 1}};
    for (const Case& c : cases) {
        checkBorder<uint8_t, 1>(z().zoriCopyReplicateBorder_8u_C1R, c.s, c.d, c.top, c.left, rng);
        checkBorder<uint8_t, 3>(z().zoriCopyReplicateBorder_8u_C3R, c.s, c.d, c.top, c.left, rng);
        checkBorder<int16_t, 1>(z().zoriCopyReplicateBorder_16s_C1R, c.s, c.d, c.top, c.left, rng);
    }
}

TEST_P(Border, Checks) {
    uint8_t a[16] = {}, b[64] = {};
    const auto f = z().zoriCopyReplicateBorder_8u_C1R;
    EXPECT_EQ(f(nullptr, 0, {0, 0}, b, 8, {4, 4}, 0, 0), StatusNullPointer);
    EXPECT_EQ(f(a, 0, {0, 0}, b, 8, {4, 4}, 0, 0), StatusBadStep);  // steps before sizes
    EXPECT_EQ(f(a, 4, {2, 2}, b, -8, {4, 4}, 0, 0), StatusBadStep);
    EXPECT_EQ(f(a, 4, {0, 2}, b, 8, {4, 4}, 0, 0), StatusBadSize);
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 0}, 0, 0), StatusBadSize);
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 4}, -1, 0), StatusBadSize);
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 4}, 0, -1), StatusBadSize);
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 4}, 0, 3), StatusBadSize);  // 3 + 2 > 4
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 4}, 3, 0), StatusBadSize);
    for (uint8_t x : b) ASSERT_EQ(x, 0);
    EXPECT_EQ(f(a, 4, {2, 2}, b, 8, {4, 4}, 2, 2), StatusOk);  // borders fit exactly
}

ZT_ALL_VARIANTS(Copy);
ZT_ALL_VARIANTS(CopyLayout);
ZT_ALL_VARIANTS(SetFill);
ZT_ALL_VARIANTS(Swap);
ZT_ALL_VARIANTS(Border);

}  // namespace
