// Copies, fills, channel layouts, channel order and replicated borders, on
// every variant, against plain loops written here.

#include <algorithm>
#include <cstdint>
#include <cstring>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

using namespace zpt;
template <class T>
using Img = zt::GuardedImage<T>;

class Copy : public zt::VariantTest {};

// Every destination pixel (DC elements) takes N elements of its source
// pixel (SC elements), as bytes (a float assignment on x87 would quiet
// signalling NaNs); its other elements stay.  Each export given in turn.
template <class T>
T elementOf(Status(ZOR_CALL*)(const T*, int, T*, int, ImageSize));

template <int SC, int DC, int N, class... Fn>
::testing::AssertionResult picks(uint32_t seed, Fn... fns) {
    const auto one = [&](auto fn) {
        using T = decltype(elementOf(fn));
        return movesAsExpected<T, T>(
            SC, DC, seed++, [fn](Img<T>& s, Img<T>& d, ImageSize r) { return fn(s.roi(), s.step(), d.roi(), d.step(), r); },
            [](const std::vector<T>& s, std::vector<T>& d) {
                for (size_t p = 0; p < s.size() / SC; ++p) std::memcpy(&d[p * DC], &s[p * SC], N * sizeof(T));
            });
    };
    ::testing::AssertionResult r = ::testing::AssertionSuccess();
    ((r = r ? one(fns) : r), ...);
    return r;
}

TEST_P(Copy, EveryPixelLayout) {
    const zt::Api& a = z();  // random bits: float NaNs move unchanged
    EXPECT_TRUE((picks<1, 1, 1>(1, a.zoriCopy_8u_C1R, a.zoriCopy_16s_C1R, a.zoriCopy_32f_C1R)));
    EXPECT_TRUE((picks<3, 3, 3>(4, a.zoriCopy_8u_C3R, a.zoriCopy_16s_C3R, a.zoriCopy_32f_C3R)));
    EXPECT_TRUE((picks<4, 4, 4>(7, a.zoriCopy_8u_C4R, a.zoriCopy_16s_C4R)));
    EXPECT_TRUE((picks<3, 1, 1>(11, a.zoriCopy_8u_C3C1R, a.zoriCopy_16s_C3C1R)));
    EXPECT_TRUE((picks<4, 1, 1>(13, a.zoriCopy_8u_C4C1R, a.zoriCopy_16s_C4C1R)));
    EXPECT_TRUE((picks<1, 3, 1>(15, a.zoriCopy_8u_C1C3R, a.zoriCopy_16s_C1C3R)));
    EXPECT_TRUE((picks<1, 4, 1>(17, a.zoriCopy_8u_C1C4R, a.zoriCopy_16s_C1C4R)));
    EXPECT_TRUE((picks<3, 4, 3>(19, a.zoriCopy_8u_C3AC4R, a.zoriCopy_16s_C3AC4R)));  // the alpha stays as it was
    EXPECT_TRUE((picks<4, 3, 3>(21, a.zoriCopy_8u_AC4C3R, a.zoriCopy_16s_AC4C3R)));
    EXPECT_TRUE((movesAsExpected<uint8_t, uint8_t>(
        1, 3, 30, [&](Img<uint8_t>& s, Img<uint8_t>& d, ImageSize r) { return a.zoriDup_8u_C1C3R(s.roi(), s.step(), d.roi(), d.step(), r); },
        [](const std::vector<uint8_t>& s, std::vector<uint8_t>& d) {
            for (size_t p = 0; p < s.size(); ++p) d[3 * p] = d[3 * p + 1] = d[3 * p + 2] = s[p];
        })));
}

// The multi-channel side's pointer picks the channel; pointing at the last
// one, its row ends one element after it, against the guard page.
TEST_P(Copy, ChannelChosenByPointer) {
    const uint8_t src[6] = {1, 2, 3, 4, 5, 6}, expect[8] = {0, 3, 0, 0, 0, 6, 0, 0};
    uint8_t one[2] = {}, four[8] = {};
    ASSERT_EQ(z().zoriCopy_8u_C3C1R(src + 2, 6, one, 2, {2, 1}), StatusOk);
    ASSERT_EQ(z().zoriCopy_8u_C1C4R(one, 2, four + 1, 8, {2, 1}), StatusOk);
    EXPECT_EQ(0, std::memcmp(four, expect, 8));
    const auto last = [&](auto fn, auto type, int sc) {
        using T = decltype(type);
        std::mt19937 rng(sc);
        for (ImageSize roi : zpt::shapes()) {
            auto s = image<T>(roi, sc, {0, false}, rng);
            auto d = image<T>(roi, 1, {0, true}, rng);
            ASSERT_EQ(fn(s->roi() + sc - 1, s->step(), d->roi(), d->step(), roi), StatusOk);
            for (int y = 0; y < roi.height; ++y)
                for (int x = 0; x < roi.width; ++x) ASSERT_EQ(*d->at(x, y), *s->at(x * sc + sc - 1, y));
        }
    };
    last(z().zoriCopy_8u_C3C1R, uint8_t(), 3), last(z().zoriCopy_8u_C4C1R, uint8_t(), 4);
    last(z().zoriCopy_16s_C3C1R, int16_t(), 3), last(z().zoriCopy_16s_C4C1R, int16_t(), 4);
}

TEST_P(Copy, MaskedCopyAndSet) {
    std::mt19937 rng(31);
    const uint8_t value[3] = {9, 99, 199};
    for (ImageSize roi : zpt::shapes()) {
        auto src = image<uint8_t>(roi, 3, {1, true}, rng);
        auto mask = image<uint8_t>(roi, 1, {2, false}, rng);
        for (int y = 0; y < roi.height; ++y)  // mostly zeros, some odd non-zero values
            for (int x = 0; x < roi.width; ++x) *mask->at(x, y) = rng() % 3 == 0 ? uint8_t(rng() | 1) : 0;
        auto dst = image<uint8_t>(roi, 3, {0, false}, rng), dst2 = image<uint8_t>(roi, 3, {0, false}, rng);
        std::vector<uint8_t> e1 = contents(*dst), e2 = contents(*dst2);
        const std::vector<uint8_t> s = contents(*src), m = contents(*mask);
        for (size_t p = 0; p < m.size(); ++p)
            for (int k = 0; k < 3 && m[p]; ++k) e1[3 * p + k] = s[3 * p + k], e2[3 * p + k] = value[k];
        ASSERT_EQ(z().zoriCopy_8u_C3MR(src->roi(), src->step(), dst->roi(), dst->step(), roi, mask->roi(), mask->step()), 0);
        ASSERT_EQ(z().zoriSet_8u_C3MR(value, dst2->roi(), dst2->step(), roi, mask->roi(), mask->step()), StatusOk);
        EXPECT_TRUE(contents(*dst) == e1 && contents(*dst2) == e2) << roi.width;
        EXPECT_TRUE(dst->outsideIntact() && dst2->outsideIntact() && mask->outsideIntact());
    }
}

// Interleaved to planes (all planes sharing one step) and back.  8-bit
// three-channel images merge rows below 160000 interleaved bytes and go row
// by row above: 100 x 533 and 100 x 534 straddle that.
template <class T, int C, class Split, class Merge>
void expectPlanes(Split split, Merge merge, std::vector<ImageSize> sizes) {
    std::mt19937 rng(C * 10 + sizeof(T));
    for (ImageSize roi : sizes)
        for (zpt::Layout l : zpt::layouts()) {
            auto src = image<T>(roi, C, l, rng), back = image<T>(roi, C, {l.padElems, !l.bordered}, rng);
            std::unique_ptr<Img<T>> planes[C];
            T* ptrs[C];
            for (int k = 0; k < C; ++k) planes[k] = image<T>(roi, 1, {l.padElems + 2, l.bordered}, rng), ptrs[k] = planes[k]->roi();
            ASSERT_EQ(split(src->roi(), src->step(), ptrs, planes[0]->step(), roi), StatusOk);
            const std::vector<T> s = contents(*src);
            for (int k = 0; k < C; ++k) {
                const std::vector<T> p = contents(*planes[k]);
                for (size_t i = 0; i < p.size(); ++i) ASSERT_EQ(p[i], s[i * C + k]) << "plane " << k << " of " << roi.width;
                ASSERT_TRUE(planes[k]->outsideIntact());
            }
            if constexpr (!std::is_same_v<Merge, std::nullptr_t>) {
                const T* cptrs[C];
                std::copy(ptrs, ptrs + C, cptrs);
                ASSERT_EQ(merge(cptrs, planes[0]->step(), back->roi(), back->step(), roi), StatusOk);
                ASSERT_TRUE(contents(*back) == s && back->outsideIntact()) << roi.width;
            }
        }
}

TEST_P(Copy, PlanarBothWays) {
    std::vector<ImageSize> sizes = zpt::shapes();
    expectPlanes<int16_t, 3>(z().zoriCopy_16s_C3P3R, z().zoriCopy_16s_P3C3R, sizes);
    expectPlanes<int16_t, 4>(z().zoriCopy_16s_C4P4R, nullptr, sizes);
    expectPlanes<uint8_t, 4>(z().zoriCopy_8u_C4P4R, z().zoriCopy_8u_P4C4R, sizes);
    sizes.insert(sizes.end(), {{100, 533}, {100, 534}});
    expectPlanes<uint8_t, 3>(z().zoriCopy_8u_C3P3R, z().zoriCopy_8u_P3C3R, sizes);
}

// Fills, long rows included (the fill is written in pieces that must keep
// the channel phase); a float fill keeps a NaN's payload.
TEST_P(Copy, Fills) {
    const std::vector<ImageSize> sizes = {{1, 1}, {7, 3}, {16, 2}, {33, 3}, {49, 2}, {100, 2}, {1500, 3}, {2001, 2}};
    // value: one element, or a pointer to one per channel
    const auto fill = [&](int c, auto set, auto value, int seed) {
        using T = std::remove_const_t<std::remove_pointer_t<decltype(value)>>;
        return movesAsExpected<T, T>(
            1, c, seed, [&](Img<T>&, Img<T>& d, ImageSize r) { return set(value, d.roi(), d.step(), r); },
            [&](const std::vector<T>&, std::vector<T>& d) {
                for (size_t i = 0; i < d.size(); ++i)
                    if constexpr (std::is_pointer_v<decltype(value)>) d[i] = value[i % c]; else d[i] = value;
            }, sizes);
    };
    EXPECT_TRUE(fill(1, z().zoriSet_8u_C1R, uint8_t(0xC3), 50));
    EXPECT_TRUE(fill(1, z().zoriSet_16s_C1R, int16_t(-12345), 51));
    EXPECT_TRUE(fill(1, z().zoriSet_32s_C1R, int32_t(-123456789), 52));
    EXPECT_TRUE(fill(1, z().zoriSet_32f_C1R, -0.0f, 53));
    float nan;  // a quiet NaN with a payload: written bit for bit
    std::memcpy(&nan, "\x45\x23\xC1\x7F", 4);
    EXPECT_TRUE(fill(1, z().zoriSet_32f_C1R, nan, 56));
    const uint8_t v8[3] = {1, 128, 255};
    const int16_t v16[3] = {-32768, 1, 32767};
    EXPECT_TRUE(fill(3, z().zoriSet_8u_C3R, v8, 54));
    EXPECT_TRUE(fill(3, z().zoriSet_16s_C3R, v16, 55));
}

// Fills above 16 MiB stream from each row's first 16-byte aligned byte on.
TEST_P(Copy, LargeFills) {
    const uint8_t v[3] = {1, 128, 255};
    Img<uint8_t> d(3 * 2400, 2400, 0, 5);
    ASSERT_EQ(z().zoriSet_8u_C3R(v, d.roi(), d.step(), {2400, 2400}), StatusOk);
    for (int y = 0; y < 2400; ++y)
        for (int x = 0; x < 3 * 2400; ++x) ASSERT_EQ(*d.at(x, y), v[x % 3]) << x << ", " << y;
    EXPECT_TRUE(d.outsideIntact());
}

// D[k] = S[o[k]] on three- or four-element pixels (alpha neither read nor
// written), in place too.
TEST_P(Copy, SwapChannels) {
    const int orders[][3] = {{2, 1, 0}, {0, 1, 2}, {1, 2, 0}, {2, 0, 1}, {0, 0, 0}, {2, 2, 1}};
    for (const auto& o : orders) {
        const auto swap = [&](auto type, int c, auto call) {
            using T = decltype(type);
            return movesAsExpected<T, T>(c, c, o[0] * 9 + o[1] * 3 + o[2], call, [&](const std::vector<T>& s, std::vector<T>& d) {
                for (size_t p = 0; p < s.size() / c; ++p)
                    for (int k = 0; k < 3; ++k) d[p * c + k] = s[p * c + o[k]];
            });
        };
        const auto apart = [&](auto fn) {
            return [fn, &o](auto& s, auto& d, ImageSize r) { return fn(s.roi(), s.step(), d.roi(), d.step(), r, o); };
        };
        EXPECT_TRUE(swap(uint8_t(), 3, apart(z().zoriSwapChannels_8u_C3R)));
        EXPECT_TRUE(swap(uint16_t(), 3, apart(z().zoriSwapChannels_16u_C3R)));
        EXPECT_TRUE(swap(uint8_t(), 4, apart(z().zoriSwapChannels_8u_AC4R)));
        EXPECT_TRUE(swap(uint16_t(), 4, apart(z().zoriSwapChannels_16u_AC4R)));
        EXPECT_TRUE(swap(uint8_t(), 3, [&](Img<uint8_t>& s, Img<uint8_t>& d, ImageSize r) {
            for (int y = 0; y < r.height; ++y) std::memcpy(d.at(0, y), s.at(0, y), 3 * r.width);
            return z().zoriSwapChannels_8u_C3IR(d.roi(), d.step(), r, o);
        }));
    }
}

// Replicated border: each destination pixel is the nearest source pixel.
TEST_P(Copy, ReplicatedBorder) {
    std::mt19937 rng(70);
    struct Case { ImageSize s, d; int top, left; };
    const Case cases[] = {{{5, 4}, {5, 4}, 0, 0},   {{5, 4}, {6, 4}, 0, 0},  {{1, 1}, {7, 5}, 2, 3},
                          {{17, 3}, {40, 9}, 3, 20}, {{3, 2}, {3, 6}, 4, 0}, {{4, 4}, {9, 4}, 0, 5},
                          {{33, 2}, {35, 3}, 1, 1}};
    const auto border = [&](auto fn, auto type, int c, const Case& k) {
        using T = decltype(type);
        auto src = image<T>(k.s, c, {1, true}, rng);
        auto dst = image<T>(k.d, c, {2, false}, rng);
        std::vector<T> e;
        for (int y = 0; y < k.d.height; ++y)
            for (int x = 0; x < k.d.width; ++x)
                for (int ch = 0; ch < c; ++ch)
                    e.push_back(*src->at(std::clamp(x - k.left, 0, k.s.width - 1) * c + ch, std::clamp(y - k.top, 0, k.s.height - 1)));
        ASSERT_EQ(fn(src->roi(), src->step(), k.s, dst->roi(), dst->step(), k.d, k.top, k.left), StatusOk);
        ASSERT_TRUE(contents(*dst) == e && dst->outsideIntact()) << k.s.width << "x" << k.s.height << " at " << k.left;
    };
    for (const Case& c : cases) {
        border(z().zoriCopyReplicateBorder_8u_C1R, uint8_t(), 1, c);
        border(z().zoriCopyReplicateBorder_8u_C3R, uint8_t(), 3, c);
        border(z().zoriCopyReplicateBorder_16s_C1R, int16_t(), 1, c);
    }
}

// Pointers, then sizes; steps are not checked (a zero source step repeats
// the first row, a negative one walks upwards) except by the channel swaps
// (after the sizes) and the border copy (before them).
TEST_P(Copy, Checks) {
    const zt::Api& a = z();
    uint8_t s[64] = {}, d[64] = {};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)};
    const uint8_t value[3] = {1, 2, 3};
    uint8_t *planes[3] = {d, d + 16, d + 32}, *oneNull[3] = {d, nullptr, d + 32};
    const uint8_t *in[4] = {s, s + 16, s + 32, s + 48}, *inNull[4] = {s, s, s, nullptr};
    const int order[3] = {2, 1, 0}, three[3] = {0, 3, 1}, minus[3] = {-1, 0, 1};
    zt::expectChecks(a.zoriCopy_8u_C1R, {s, 8, d, 8, ImageSize{8, 8}}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 1})));
    zt::expectChecks(a.zoriCopy_16s_C4C1R, {(const int16_t*)s, 16, (int16_t*)d, 8, ImageSize{2, 2}}, w, zt::eachNull(), zt::badRoi<4>());
    zt::expectChecks(a.zoriDup_8u_C1C3R, {s, 2, d, 6, ImageSize{2, 8}}, w, zt::eachNull(), zt::badRoi<4>());
    zt::expectChecks(a.zoriCopy_8u_C3MR, {s, 6, d, 6, ImageSize{2, 8}, s, 2}, w, zt::eachNull(), zt::badRoi<4>());
    zt::expectChecks(a.zoriCopy_8u_C3P3R, {s, 12, planes, 4, ImageSize{4, 4}}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusNullPointer, zt::arg<2>(oneNull), zt::arg<4>(ImageSize{0, 1})));
    zt::expectChecks(a.zoriCopy_8u_P4C4R, {in, 4, d, 16, ImageSize{4, 4}}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(inNull)));
    zt::expectChecks(a.zoriSet_8u_C1R, {uint8_t(3), d, 8, ImageSize{8, 8}}, w, zt::eachNull(), zt::badRoi<3>());
    zt::expectChecks(a.zoriSet_8u_C3R, {value, d, 24, ImageSize{8, 2}}, w, zt::eachNull(), zt::badRoi<3>());
    zt::expectChecks(a.zoriSet_8u_C3MR, {value, d, 24, ImageSize{8, 2}, s, 8}, w, zt::eachNull(), zt::badRoi<3>());
    zt::expectChecks(a.zoriSwapChannels_8u_C3R, {s, 6, d, 6, ImageSize{2, 2}, order}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusBadStep, zt::arg<3>(0)), zt::bad(StatusBadStep, zt::arg<1>(-6)),
                     zt::bad(StatusChannelOrder, zt::arg<5>(three)), zt::bad(StatusChannelOrder, zt::arg<5>(minus)),
                     zt::bad(StatusBadSize, zt::arg<1>(0), zt::arg<4>(ImageSize{0, 2}), zt::arg<5>(three)),
                     zt::bad(StatusBadStep, zt::arg<3>(0), zt::arg<5>(three)));
    zt::expectChecks(a.zoriSwapChannels_8u_C3IR, {d, 6, ImageSize{2, 2}, order}, w, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusChannelOrder, zt::arg<3>(minus)));
    zt::expectChecks(a.zoriCopyReplicateBorder_8u_C1R, {s, 4, ImageSize{2, 2}, d, 8, ImageSize{4, 4}, 2, 2}, w,
                     zt::eachNull(), zt::badRoi<2>(), zt::badRoi<5>(), zt::bad(StatusBadStep, zt::arg<1>(0)),
                     zt::bad(StatusBadStep, zt::arg<4>(-8)), zt::bad(StatusBadSize, zt::arg<6>(-1)),
                     zt::bad(StatusBadSize, zt::arg<7>(-1)), zt::bad(StatusBadSize, zt::arg<6>(3)),
                     zt::bad(StatusBadSize, zt::arg<7>(3)), zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<2>(ImageSize{0, 0})));
    for (int i = 0; i < 64; ++i) s[i] = uint8_t(i);
    ASSERT_EQ(a.zoriCopy_8u_C1R(s, 0, d, 5, {5, 4}), StatusOk);
    for (int i = 0; i < 20; ++i) ASSERT_EQ(d[i], i % 5);
    ASSERT_EQ(a.zoriCopy_8u_C3R(s + 48, -16, d, 6, {2, 4}), StatusOk);
    for (int i = 0; i < 24; ++i) ASSERT_EQ(d[i], 48 - 16 * (i / 6) + i % 6);
    ASSERT_EQ(a.zoriCopy_8u_C3P3R(s + 30, -10, planes, 4, {2, 3}), StatusOk);
    for (int i = 0; i < 6; ++i)
        for (int k = 0; k < 3; ++k) ASSERT_EQ(planes[k][i / 2 * 4 + i % 2], 30 - 10 * (i / 2) + 3 * (i % 2) + k);
    std::memset(d, 0, sizeof d);
    EXPECT_EQ(a.zoriSet_8u_C1R(3, d, 0, {5, 3}), StatusOk);
    EXPECT_EQ(a.zoriSet_32s_C1R(-2, reinterpret_cast<int32_t*>(d + 8), 0, {2, 2}), StatusOk);
    const uint8_t expectSet[16] = {3, 3, 3, 3, 3, 0, 0, 0, 0xFE, 0xFF, 0xFF, 0xFF, 0xFE, 0xFF, 0xFF, 0xFF};
    EXPECT_EQ(0, std::memcmp(d, expectSet, 16));
}

ZT_ALL_VARIANTS(Copy);

}  // namespace
