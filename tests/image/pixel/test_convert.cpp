// Type conversions and 16-bit left shifts on every variant.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/variants.h"

namespace {

using zpt::contents;
using zpt::image;

class Convert : public zt::VariantTest {};
class Shift : public zt::VariantTest {};

// Exact reference of the float to 8-bit rule.
uint8_t refU8(float v, int mode) {
    if (v >= 255.0f) return 255;
    if (!(v > 0.0f)) return 0;
    const double d = v;
    double t = std::floor(d);
    if (mode == 1) {
        const double frac = d - t;
        if (frac > 0.5 || (frac == 0.5 && std::fmod(t, 2.0) != 0)) t += 1;
    }
    return static_cast<uint8_t>(t);
}

template <class S, class D, int C, class F, class Ref>
void checkConvert(F fn, Ref ref, uint32_t seed, std::vector<S> (*gen)(std::mt19937&, size_t) = nullptr) {
    std::mt19937 rng(seed);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto src = image<S>(roi, C, l, rng);
            if (gen) {
                const std::vector<S> v = gen(rng, size_t(roi.width) * C * roi.height);
                for (int y = 0; y < roi.height; ++y)
                    std::memcpy(src->at(0, y), &v[size_t(y) * roi.width * C], sizeof(S) * roi.width * C);
            }
            auto dst = image<D>(roi, C, {l.padElems + 1, !l.bordered}, rng);
            ASSERT_EQ(fn(src->roi(), src->step(), dst->roi(), dst->step(), roi), StatusOk);
            const std::vector<S> s = contents(*src);
            const std::vector<D> d = contents(*dst);
            for (size_t i = 0; i < s.size(); ++i) ASSERT_EQ(d[i], ref(s[i])) << "element " << i << " of " << roi.width;
            ASSERT_TRUE(dst->outsideIntact());
        }
}

// Floats around every interesting point: ties, the ends of the range, NaN,
// infinities, denormals, negative zero.
std::vector<float> floatSamples(std::mt19937& rng, size_t n) {
    static const float special[] = {2.5f,    3.5f,   254.5f, 254.9f,  -0.3f,   300.0f, 2.9f,
                                    0.5f,    1.5f,   255.0f, 254.49f, -0.0f,   1e-40f, 0.50000006f,
                                    0.49999997f, -1e30f, 1e30f, 253.5f, 127.5f, 128.5f};
    std::vector<float> v(n);
    for (size_t i = 0; i < n; ++i) {
        switch (rng() % 4) {
        case 0: v[i] = special[rng() % (sizeof special / sizeof special[0])]; break;
        case 1: v[i] = static_cast<float>(rng() % 600) / 2.0f - 20.0f; break;  // many ties
        case 2: v[i] = std::uniform_real_distribution<float>(-10.0f, 270.0f)(rng); break;
        default: {
            const uint32_t b = rng();
            std::memcpy(&v[i], &b, 4);  // any bits, NaNs included
        }
        }
    }
    v[0] = std::numeric_limits<float>::quiet_NaN();
    if (n > 1) v[1] = std::numeric_limits<float>::infinity();
    return v;
}

TEST_P(Convert, Widening) {
    const auto wide = [](uint8_t v) { return uint16_t(v); };
    checkConvert<uint8_t, uint16_t, 1>(z().zoriConvert_8u16u_C1R, wide, 1);
    checkConvert<uint8_t, uint16_t, 3>(z().zoriConvert_8u16u_C3R, wide, 2);
    checkConvert<uint8_t, uint16_t, 4>(z().zoriConvert_8u16u_C4R, wide, 3);
    checkConvert<uint8_t, float, 1>(z().zoriConvert_8u32f_C1R, [](uint8_t v) { return float(v); }, 4);
    checkConvert<int16_t, float, 1>(z().zoriConvert_16s32f_C1R, [](int16_t v) { return float(v); }, 5);
}

TEST_P(Convert, FloatTo8uBothModes) {
    for (int mode : {1, 0, 2, -1}) {
        const auto fn = [&](const float* s, int ss, uint8_t* d, int sd, ImageSize r) {
            return z().zoriConvert_32f8u_C1R(s, ss, d, sd, r, mode);
        };
        checkConvert<float, uint8_t, 1>(fn, [&](float v) { return refU8(v, mode == 1 ? 1 : 0); }, 6 + mode,
                                        floatSamples);
    }
}

TEST_P(Convert, FloatTo8uNamedValues) {
    const float in[] = {2.5f, 3.5f, 254.5f, 254.9f, -0.3f, 300.0f, 2.9f};
    const uint8_t nearest[] = {2, 4, 254, 255, 0, 255, 3}, trunc[] = {2, 3, 254, 254, 0, 255, 2};
    uint8_t out[7];
    ASSERT_EQ(z().zoriConvert_32f8u_C1R(in, sizeof in, out, 7, {7, 1}, 1), StatusOk);
    EXPECT_EQ(0, std::memcmp(out, nearest, 7));
    ASSERT_EQ(z().zoriConvert_32f8u_C1R(in, sizeof in, out, 7, {7, 1}, 0), StatusOk);
    EXPECT_EQ(0, std::memcmp(out, trunc, 7));
}

TEST_P(Convert, SimdAgreesWithGeneric) {
    std::mt19937 rng(9);
    const std::vector<float> f = floatSamples(rng, 4099);
    std::vector<uint8_t> a(4099), b(4099);
    ASSERT_EQ(z().zoriConvert_32f8u_C1R(f.data() + 1, 4096, a.data() + 3, 1024, {1021, 4}, 1), StatusOk);
    ASSERT_EQ(zt::api(0).zoriConvert_32f8u_C1R(f.data() + 1, 4096, b.data() + 3, 1024, {1021, 4}, 1), StatusOk);
    EXPECT_EQ(a, b);
}

// Mostly in-range values with a few values that the conversion instruction
// cannot represent (NaN of either sign, infinities, 2^31 and beyond, values at
// or below -32768) sprinkled over the rows: blocks with and without such a
// value side by side, the odd value at every position of a block.  The
// source starts at every float offset from a 16-byte boundary.
TEST_P(Convert, FloatTo8uRareOutOfRangeValues) {
    std::mt19937 rng(12);
    float nanBits[2];
    const uint32_t nb[2] = {0x7FC00001u, 0xFFC00000u};
    std::memcpy(nanBits, nb, sizeof nb);
    const float odd[] = {nanBits[0], nanBits[1], std::numeric_limits<float>::infinity(),
                         -std::numeric_limits<float>::infinity(), 2147483648.0f, 3e9f, 1e30f, -2147483648.0f,
                         -40000.0f, -32768.5f, -32768.0f, -32767.5f, 32767.5f, 65535.0f};
    const ImageSize roi = {1001, 3};
    const size_t count = size_t(roi.width) * roi.height;
    std::vector<float> v(count);
    for (float& x : v)
        x = rng() % 2 ? float(rng() % 600) / 2.0f - 20.0f : std::uniform_real_distribution<float>(-5.0f, 260.0f)(rng);
    for (size_t i = 0; i < v.size(); i += 1 + rng() % 200) v[i] = odd[rng() % (sizeof odd / sizeof odd[0])];
    zt::GuardedBuffer buf(count * sizeof(float) + 32);
    uint8_t* base = static_cast<uint8_t*>(buf.data());
    base += (16 - reinterpret_cast<uintptr_t>(base) % 16) % 16;
    for (int offset : {0, 4, 8, 12}) {
        uint8_t* src = base + offset;
        std::memcpy(src, v.data(), count * sizeof(float));
        for (int mode : {1, 0}) {
            std::vector<uint8_t> out(count, 0xAB);
            ASSERT_EQ(z().zoriConvert_32f8u_C1R(reinterpret_cast<const float*>(src), roi.width * 4, out.data(),
                                                roi.width, roi, mode),
                      StatusOk);
            for (size_t i = 0; i < count; ++i)
                ASSERT_EQ(out[i], refU8(v[i], mode)) << "offset " << offset << " mode " << mode << " element " << i;
        }
    }
}

// Mode 1 gives ties to even whatever rounding mode the caller has set, and
// leaves that mode and the caller's raised flags as they were; with the
// invalid exception unmasked, out-of-range values do not trap.
TEST_P(Convert, FloatTo8uKeepsTheCallersFloatingPointState) {
    std::mt19937 rng(13);
    const ImageSize roi = {203, 3};
    std::vector<float> v = floatSamples(rng, size_t(roi.width) * roi.height);
    for (int fe : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::vector<uint8_t> out(v.size());
        std::feclearexcept(FE_ALL_EXCEPT);
        std::feraiseexcept(FE_INVALID);
        ASSERT_EQ(std::fesetround(fe), 0);
        const Status s = z().zoriConvert_32f8u_C1R(v.data(), roi.width * 4, out.data(), roi.width, roi, 1);
        const int after = std::fegetround();
        const bool invalidKept = std::fetestexcept(FE_INVALID) != 0;
        std::fesetround(FE_TONEAREST);
        ASSERT_EQ(s, StatusOk);
        EXPECT_EQ(after, fe);
        EXPECT_TRUE(invalidKept);
        for (size_t i = 0; i < v.size(); ++i) ASSERT_EQ(out[i], refU8(v[i], 1)) << fe << " element " << i;
    }
    std::feclearexcept(FE_ALL_EXCEPT);
#if defined(__GLIBC__)
    for (float& x : v)
        if (std::isnan(x)) x = 3e9f;  // a NaN is invalid in any case
    std::vector<uint8_t> out(v.size());
    feenableexcept(FE_INVALID);
    const Status s = z().zoriConvert_32f8u_C1R(v.data(), roi.width * 4, out.data(), roi.width, roi, 1);
    fedisableexcept(FE_INVALID);
    ASSERT_EQ(s, StatusOk);
    for (size_t i = 0; i < v.size(); ++i) ASSERT_EQ(out[i], refU8(v[i], 1)) << "element " << i;
#endif
}

TEST_P(Convert, Checks) {
    uint8_t a[16] = {};
    float f[16] = {};
    const auto& z = this->z();
    EXPECT_EQ(z.zoriConvert_8u32f_C1R(nullptr, 0, f, 0, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriConvert_8u32f_C1R(a, 0, f, 0, {0, 1}), StatusBadSize);  // sizes before steps
    EXPECT_EQ(z.zoriConvert_8u32f_C1R(a, 0, f, 16, {1, 1}), StatusBadStep);
    EXPECT_EQ(z.zoriConvert_16s32f_C1R(reinterpret_cast<int16_t*>(a), 4, f, -4, {1, 1}), StatusBadStep);
    EXPECT_EQ(z.zoriConvert_8u16u_C3R(a, 3, nullptr, 6, {1, 1}), StatusNullPointer);
    EXPECT_EQ(z.zoriConvert_8u16u_C4R(a, 4, reinterpret_cast<uint16_t*>(f), 8, {1, -1}), StatusBadSize);
    EXPECT_EQ(z.zoriConvert_32f8u_C1R(f, 4, a, 0, {1, 1}, 1), StatusBadStep);
    for (float x : f) ASSERT_EQ(x, 0.0f);
    for (uint8_t x : a) ASSERT_EQ(x, 0);
}

uint16_t refShift(uint16_t v, uint32_t s) { return s > 15 ? 0 : uint16_t(uint32_t(v) << s); }

template <int C, class F>
void checkShift(F fn, const uint32_t (&counts)[3], uint32_t seed) {
    std::mt19937 rng(seed);
    for (ImageSize roi : zpt::shapes())
        for (zpt::Layout l : zpt::layouts()) {
            auto img = image<uint16_t>(roi, C, l, rng);
            std::vector<uint16_t> e = contents(*img);
            for (size_t i = 0; i < e.size(); ++i)
                if (C == 1 || i % C < 3) e[i] = refShift(e[i], counts[C == 1 ? 0 : i % C]);
            ASSERT_EQ(fn(counts, img->roi(), img->step(), roi), StatusOk);
            ASSERT_EQ(contents(*img), e) << roi.width;
            ASSERT_TRUE(img->outsideIntact());
        }
}

TEST_P(Shift, Counts) {
    const uint32_t sets[][3] = {{1, 1, 1}, {0, 0, 0}, {16, 17, 0xFFFFFFFFu}, {0, 5, 15}, {3, 16, 1}, {15, 15, 15}};
    for (const auto& c : sets) {
        const auto c1 = [&](const uint32_t* v, uint16_t* p, int s, ImageSize r) {
            return z().zoriLShiftC_16u_C1IR(v[0], p, s, r);
        };
        checkShift<1>(c1, c, 20);
        checkShift<3>(z().zoriLShiftC_16u_C3IR, c, 21);
        checkShift<4>(z().zoriLShiftC_16u_AC4IR, c, 22);  // alpha never changes
    }
    uint16_t v[2] = {40000, 40000};
    ASSERT_EQ(z().zoriLShiftC_16u_C1IR(1, v, 4, {2, 1}), StatusOk);
    EXPECT_EQ(v[0], 14464);
    ASSERT_EQ(z().zoriLShiftC_16u_C1IR(16, v, 4, {2, 1}), StatusOk);
    EXPECT_EQ(v[1], 0);
}

TEST_P(Shift, StepBeforeSize) {
    uint16_t p[8] = {1, 2, 3, 4, 5, 6, 7, 8};
    const uint32_t c[3] = {1, 1, 1};
    const auto& z = this->z();
    EXPECT_EQ(z.zoriLShiftC_16u_C1IR(1, nullptr, 0, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriLShiftC_16u_C3IR(nullptr, p, 0, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriLShiftC_16u_C1IR(1, p, 0, {0, 0}), StatusBadStep);
    EXPECT_EQ(z.zoriLShiftC_16u_AC4IR(c, p, -8, {0, 1}), StatusBadStep);
    EXPECT_EQ(z.zoriLShiftC_16u_C3IR(c, p, 6, {0, 1}), StatusBadSize);
    for (int i = 0; i < 8; ++i) ASSERT_EQ(p[i], i + 1);
}

ZT_ALL_VARIANTS(Convert);
ZT_ALL_VARIANTS(Shift);

}  // namespace
