// Type conversions and 16-bit left shifts on every variant.
#include <algorithm>
#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

using zpt::movesAsExpected;
template <class T>
using Img = zt::GuardedImage<T>;

class Convert : public zt::VariantTest {};

// The float to 8-bit rule, exactly: saturated, NaN to 0, mode 1 nearest
// with ties to even, any other mode truncated.
uint8_t refU8(float v, int mode) {
    return v >= 255.0f ? 255 : !(v > 0.0f) ? 0 : uint8_t(mode == 1 ? std::nearbyint(double(v)) : std::trunc(double(v)));
}

// Floats around every interesting point (ties, the ends of the range, NaN,
// infinities, denormals, negative zero) and a few values the conversion
// instruction cannot represent (2^31 and beyond, at or below -32768), over
// plain ones.
std::vector<float> floatSamples(std::mt19937& rng, size_t n) {
    static const float special[] = {2.5f, 3.5f, 254.5f, 254.9f, -0.3f, 300.0f, 2.9f, 0.5f, 1.5f, 255.0f, 254.49f,
                                    -0.0f, 1e-40f, 0.50000006f, 0.49999997f, -1e30f, 1e30f, 253.5f, 127.5f, 128.5f,
                                    2147483648.0f, 3e9f, -2147483648.0f, -40000.0f, -32768.5f, -32768.0f, 32767.5f,
                                    std::numeric_limits<float>::infinity(), -std::numeric_limits<float>::infinity(),
                                    std::numeric_limits<float>::quiet_NaN(), -std::numeric_limits<float>::quiet_NaN()};
    std::vector<float> v(n);
    for (float& x : v) {
        const uint32_t r = rng();
        x = r % 64 == 0 ? special[r / 64 % (sizeof special / sizeof special[0])]
                        : r % 2 ? float(r / 2 % 600) / 2.0f - 20.0f : float(r % 2700) / 10.0f - 10.0f;
    }
    return v;
}

template <int C, class S, class D>
::testing::AssertionResult converts(Status(ZOR_CALL* fn)(const S*, int, D*, int, ImageSize), uint32_t seed) {
    return movesAsExpected<S, D>(
        C, C, seed, [fn](Img<S>& s, Img<D>& d, ImageSize r) { return fn(s.roi(), s.step(), d.roi(), d.step(), r); },
        [](const std::vector<S>& s, std::vector<D>& d) { std::copy(s.begin(), s.end(), d.begin()); });
}

TEST_P(Convert, Widening) {
    EXPECT_TRUE((converts<1>(z().zoriConvert_8u16u_C1R, 1)));
    EXPECT_TRUE((converts<3>(z().zoriConvert_8u16u_C3R, 2)));
    EXPECT_TRUE((converts<4>(z().zoriConvert_8u16u_C4R, 3)));
    EXPECT_TRUE((converts<1>(z().zoriConvert_8u32f_C1R, 4)));
    EXPECT_TRUE((converts<1>(z().zoriConvert_16s32f_C1R, 5)));
}

// Outputs of more than 16 MiB go out with non-temporal stores from the
// first 16-byte aligned float of each row on.
TEST_P(Convert, LargeWidening) {
    Img<uint8_t> s(2100, 2100, 0, 3);
    Img<float> d(2100, 2100, 0, 4);
    s.fill([](int x, int y) { return (x * 7 + y * 3) & 255; });
    ASSERT_EQ(z().zoriConvert_8u32f_C1R(s.roi(), s.step(), d.roi(), d.step(), {2100, 2100}), StatusOk);
    for (int y = 0; y < d.height(); ++y)
        for (int x = 0; x < d.width(); ++x) ASSERT_EQ(*d.at(x, y), float((x * 7 + y * 3) & 255)) << x << ", " << y;
    EXPECT_TRUE(d.outsideIntact());
}

// Mode `mode` against the exact rule on the samples, the rare values alone
// among ordinary ones in every position of a block, under the caller's
// state: 0 as it is; 1 an upward rounding mode with the invalid flag raised,
// which must not change the ties nor be changed; 2 (where it can be set) the
// invalid exception unmasked, which must not trap (NaN, invalid to compare
// anyway, left out).
::testing::AssertionResult convertsFloats(const zt::Api& z, int mode, int state) {
    return movesAsExpected<float, uint8_t>(
        1, 1, 6 + mode,
        [&](Img<float>& s, Img<uint8_t>& d, ImageSize r) {
            std::mt19937 rng(r.width + mode);
            for (int y = 0; y < r.height; ++y) {
                std::vector<float> v = floatSamples(rng, r.width);
                if (state == 2) std::replace_if(v.begin(), v.end(), [](float x) { return std::isnan(x); }, 3e9f);
                std::memcpy(s.at(0, y), v.data(), 4 * r.width);
            }
            if (state == 1) std::feraiseexcept(FE_INVALID), std::fesetround(FE_UPWARD);
#if defined(__GLIBC__)
            if (state == 2) std::feclearexcept(FE_ALL_EXCEPT), feenableexcept(FE_INVALID);
#endif
            const Status st = z.zoriConvert_32f8u_C1R(s.roi(), s.step(), d.roi(), d.step(), r, mode);
            // the sum rounds by the SSE mode where fegetround reads the x87 one
            volatile float one = 1.0f, tiny = 1e-10f;
            const bool kept =
                state != 1 || (std::fegetround() == FE_UPWARD && std::fetestexcept(FE_INVALID) && one + tiny > 1.0f);
#if defined(__GLIBC__)
            fedisableexcept(FE_INVALID);
#endif
            std::fesetround(FE_TONEAREST), std::feclearexcept(FE_ALL_EXCEPT);
            return kept ? st : StatusBadArgument;  // the caller's state lost
        },
        [&](const std::vector<float>& s, std::vector<uint8_t>& d) {
            for (size_t i = 0; i < s.size(); ++i) d[i] = refU8(s[i], mode);
        }, {{1, 1}, {7, 3}, {16, 2}, {33, 3}, {100, 2}, {203, 3}, {1001, 3}});
}

// Mode 1 nearest with ties to even, any other value truncates.
TEST_P(Convert, FloatTo8u) {
    for (int mode : {1, 0, 2, -1}) EXPECT_TRUE(convertsFloats(z(), mode, 0)) << "mode " << mode;
}

// Kept apart from FloatTo8u, which also runs under valgrind: valgrind
// models neither the SSE status flags nor the SSE rounding mode.
TEST_P(Convert, FloatTo8uKeepsTheCallersFloatingPointState) {
    for (int state : {1, 2}) EXPECT_TRUE(convertsFloats(z(), 1, state)) << "state " << state;
}

// Shifts: counts above 15 give 0; the alpha of AC4 never changes.
TEST_P(Convert, LeftShifts) {
    const uint32_t sets[][3] = {{1, 1, 1}, {0, 0, 0}, {16, 17, 0xFFFFFFFFu}, {0, 5, 15}, {3, 16, 1}, {15, 15, 15}};
    for (const auto& c : sets)
        for (int ch : {1, 3, 4})
            EXPECT_TRUE((movesAsExpected<uint16_t, uint16_t>(
                ch, ch, c[1] * 3 + ch,
                [&](Img<uint16_t>& s, Img<uint16_t>& d, ImageSize r) {
                    for (int y = 0; y < r.height; ++y) std::memcpy(d.at(0, y), s.at(0, y), 2 * ch * r.width);
                    return ch == 1 ? z().zoriLShiftC_16u_C1IR(c[0], d.roi(), d.step(), r)
                           : ch == 3 ? z().zoriLShiftC_16u_C3IR(c, d.roi(), d.step(), r)
                                     : z().zoriLShiftC_16u_AC4IR(c, d.roi(), d.step(), r);
                },
                [&](const std::vector<uint16_t>& s, std::vector<uint16_t>& d) {
                    for (size_t i = 0; i < s.size(); ++i) {
                        const uint32_t k = ch == 1 ? c[0] : i % ch < 3 ? c[i % ch] : 0;  // alpha: 0
                        d[i] = k > 15 ? 0 : uint16_t(uint32_t(s[i]) << k);
                    }
                })))
                << ch << " channels, counts " << c[0] << " " << c[1] << " " << c[2];
}

// Conversions: pointers, sizes, then steps; shifts: pointers, the step, then sizes.
TEST_P(Convert, Checks) {
    const zt::Api& a = z();
    uint8_t b[64] = {};
    float f[16] = {};
    uint16_t p[8] = {1, 2, 3, 4, 5, 6, 7, 8};
    const uint32_t c[3] = {1, 1, 1};
    const std::vector<zt::Watch> w{zt::watch(f, sizeof f)}, wp{zt::watch(p, sizeof p)};
    zt::expectChecks(a.zoriConvert_8u32f_C1R, {b, 4, f, 16, ImageSize{4, 4}}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusBadStep, zt::arg<3>(0)), zt::bad(StatusBadStep, zt::arg<1>(-4)),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<1>(0), zt::arg<4>(ImageSize{0, 1})));
    zt::expectChecks(a.zoriLShiftC_16u_C3IR, {c, p, 6, ImageSize{1, 2}}, wp, zt::eachNull(), zt::badRoi<3>(),
                     zt::bad(StatusBadStep, zt::arg<2>(0)), zt::bad(StatusBadStep, zt::arg<2>(-8), zt::arg<3>(ImageSize{0, 1})),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<2>(0)));
}

ZT_ALL_VARIANTS(Convert);

}  // namespace
