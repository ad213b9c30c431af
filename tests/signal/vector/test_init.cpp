// Vector zero, set, copy and conversions, on every variant's entries.
#include <gtest/gtest.h>

#include <algorithm>
#include <cfenv>
#include <cmath>
#include <limits>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecInit : public zt::VariantTest {};

// Set with val's exact bytes on 63 elements at an odd address (a tail after
// whole registers for most element sizes), the bytes around left alone.  On
// 32-bit x86 a float argument could pass through an x87 register in the
// caller (quieting a signalling NaN), so there the bits travel as bits
// (same size, same stack slot).
template <class T, class B>
void expectSetStoresBits(Status(ZOR_CALL* set)(T, T*, int), const B& bits) {
    using Arg = std::conditional_t<sizeof(void*) == 4, B, T>;
    Arg arg;
    std::memcpy(&arg, &bits, sizeof arg);
    std::vector<uint8_t> buf(65 * sizeof(T) + 1, 0xA5), want = buf;
    T* const dst = reinterpret_cast<T*>(&buf[sizeof(T) + 1]);  // element i at byte (i + 1) * sizeof(T) + 1
    for (int i = 1; i <= 63; ++i) std::memcpy(&want[i * sizeof(T) + 1], &bits, sizeof(T));
    ASSERT_EQ(reinterpret_cast<Status(ZOR_CALL*)(Arg, T*, int)>(set)(arg, dst, 63), StatusOk);
    EXPECT_EQ(buf, want);
}

// fn(src, d, n, a...) against ref(src[i], D()) element by element, on all of
// src and on all but its first element (another tail, another address),
// source and destination against guard pages.
template <class S, class D, class R, class... P, class... A>
void expectEach(Status(ZOR_CALL* fn)(const S*, D*, int, P...), const std::vector<S>& src, R ref, A... a) {
    for (size_t n : {src.size(), src.size() - 1}) {
        zt::GuardedBuffer s(n * sizeof(S)), d(n * sizeof(D));
        std::memcpy(s.data(), src.data() + src.size() - n, n * sizeof(S));
        ASSERT_EQ(fn(s.as<S>(), d.as<D>(), static_cast<int>(n), a...), StatusOk);
        for (size_t i = 0; i < n; ++i) ASSERT_EQ(+d.as<D>()[i], +ref(s.as<S>()[i], D())) << +s.as<S>()[i];
    }
}

// The exact scaled value rounded to nearest-even (RoundNear) or toward zero
// (any other mode), then clamped; NaN gives the lowest value of a signed
// type, 0 of an unsigned one.  Independent of the rounding mode.
auto narrowed(int rndMode, int sf) {
    return [=](double src, auto d) {
        using L = std::numeric_limits<decltype(d)>;
        volatile double m = std::ldexp(1.0, sf < -5000 ? 5000 : -sf);  // a double: x87 would keep 2^5000
        const double x = src * m, c = std::fmax(-1e10, std::fmin(x, 1e10));
        const double r = x != x ? L::min() : rndMode == RoundNear ? c - std::remainder(c, 1.0) : std::trunc(c);
        return r >= double(L::max()) ? L::max() : r <= double(L::min()) ? L::min() : decltype(d)(r);
    };
}

// Ties, bounds and specials of every destination type among random values
// over [-range, range] (a third of them ties), in random places.
template <class S>
std::vector<S> narrowSources(unsigned seed, double range) {
    const double special[] = {0.5, -0.5, 1.5, -1.5, 2.5, -2.5, 0.49999997, 127.5, -128.5, 255.5, 254.5, 32767.5,
                              -32768.5, 65535.5, 2147483520.0, 2147483648.0, -2147483648.0, -2147483904.0, 1e30, -1e30,
                              -0.0, NAN, -NAN, INFINITY, -INFINITY};
    std::vector<S> v(std::begin(special), std::end(special));
    std::mt19937 rng(seed);
    std::uniform_real_distribution<double> u(-range, range);
    for (int i = 0; i < 400; ++i) v.push_back(S(i % 3 ? u(rng) : std::floor(u(rng)) + 0.5));
    std::shuffle(v.begin(), v.end(), rng);
    return v;
}

}  // namespace

// Every member goes through one of these templates; pointers are checked
// before the length.
TEST_P(VecInit, ChecksComeInOrderAndWriteNothing) {
    double d[8] = {1, 2, 3};
    int32_t i[8] = {1, 2, 3};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d), zt::watch(i, sizeof i)};
    zt::expectChecks(z().zorsZero_64f, {d, 8}, w, zt::eachNull(), zt::badLength<1>());
    zt::expectChecks(z().zorsSet_64f, {1.5, d, 8}, w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z().zorsCopy_64f, {d + 4, d, 4}, w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z().zorsConvert_32s64f, {i, d, 8}, w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z().zorsConvert_64f32s_Sfs, {d, i, 8, int(RoundNear), -2}, w, zt::eachNull(), zt::badLength<2>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<2>(INT32_MIN)));
}

// Zero clears exactly its elements; set stores the caller's bits (signalling
// NaNs stay signalling, complex parts stay in their places); copy gives what
// a copy through a temporary would, overlapping either way.
TEST_P(VecInit, ZeroSetAndCopyMoveBytes) {
    const auto& z = this->z();
    std::vector<int16_t> h(40, -1);
    ASSERT_EQ(z.zorsZero_16s(h.data() + 1, 37), StatusOk);  // odd address, odd length
    for (int i = 0; i < 40; ++i) EXPECT_EQ(h[i], i == 0 || i > 37 ? -1 : 0) << i;
    // One member of each element size; the float ones get signalling NaNs.
    expectSetStoresBits(z.zorsSet_8u, uint8_t(0x81)), expectSetStoresBits(z.zorsSet_16s, int16_t(-2));
    expectSetStoresBits(z.zorsSet_32f, 0xffa00001u), expectSetStoresBits(z.zorsSet_64f, UINT64_C(0x7ff0000000000001));
    expectSetStoresBits(z.zorsSet_64fc, Complex64s{-0xffffffffffffe, INT64_MIN});  // {-NaN, -0}
    for (int from : {0, 3}) {
        std::vector<int16_t> v(40), want(40);
        for (int i = 0; i < 40; ++i) v[i] = want[i] = int16_t(i);
        std::copy(v.begin() + from, v.begin() + from + 30, want.begin() + 3 - from);
        ASSERT_EQ(z.zorsCopy_16s(v.data() + from, v.data() + 3 - from, 30), StatusOk);
        EXPECT_EQ(v, want) << from;
    }
}

// 8- and 16-bit sources exactly, every value; 32-bit ones rounded to the
// nearest float (ties to even) or saturated to 16 bits.  The lengths, n and
// n - 1 of 98304 and 320, leave at every register width passes of two
// blocks, then one block, then a tail.
TEST_P(VecInit, WideningIsExactOrRoundsOnce) {
    const auto& z = this->z();
    const auto exact = [](auto v, auto d) { return static_cast<decltype(d)>(v); };
    const auto every = [](auto s) { std::vector<decltype(s)> v(98304); for (auto& x : v) x = s++; return v; };
    expectEach(z.zorsConvert_8s16s, every(int8_t()), exact), expectEach(z.zorsConvert_8u32f, every(uint8_t()), exact);
    expectEach(z.zorsConvert_8s32f, every(int8_t()), exact), expectEach(z.zorsConvert_16s32s, every(int16_t()), exact);
    expectEach(z.zorsConvert_16s32f, every(int16_t()), exact), expectEach(z.zorsConvert_16u32f, every(uint16_t()), exact);
    std::vector<int32_t> v = {16777217, -16777221, INT32_MAX - 63, INT32_MAX - 64, INT32_MAX, INT32_MIN, 32768, -32769};
    for (uint32_t i = 0; v.size() < 320; ++i) v.push_back(int32_t(i * 2654435761u) >> i % 32);  // all magnitudes
    expectEach(z.zorsConvert_32s32f, v, [](int32_t x, float) { volatile double d = x; return float(d); });
    expectEach(z.zorsConvert_32s64f, v, exact);
    expectEach(z.zorsConvert_32s16s, v, [](int32_t x, int16_t) { return int16_t(std::clamp(x, -32768, 32767)); });
}

// Every scale factor, up to multipliers past the ends of the double range
// (halving past 2^-1074 gives 0, doubling past 2^1023 infinity; NaN where
// they meet infinity or 0); rndMode 7 acts as RoundZero.
TEST_P(VecInit, FloatToIntegerAgainstExactReference) {
    for (int mode : {int(RoundNear), int(RoundZero), 7})
        for (int sf : {0, 1, 5, -1, -9, 20, -20, 1074, 1075, -1023, INT32_MAX, INT32_MIN}) {
            const auto each = [&](auto fn, auto s, double range) {
                range *= std::ldexp(1.0, std::clamp(sf, -30, 30));
                expectEach(fn, narrowSources<decltype(s)>(unsigned(sf) * 7 + mode, range), narrowed(mode, sf), mode, sf);
            };
            each(z().zorsConvert_32f8u_Sfs, 0.0f, 300), each(z().zorsConvert_32f8s_Sfs, 0.0f, 150);
            each(z().zorsConvert_32f16u_Sfs, 0.0f, 70000), each(z().zorsConvert_32f16s_Sfs, 0.0f, 35000);
            each(z().zorsConvert_32f32s_Sfs, 0.0f, 3e9), each(z().zorsConvert_64f32s_Sfs, 0.0, 3e9);
        }
    // Double sources: half away from zero, then back on odd exact ties, so
    // 0.5 + 2^-53 (which sums to exactly 1.0) gives 0.
    const std::vector<double> d(37, std::nextafter(0.5, 1.0));
    expectEach(z().zorsConvert_64f32s_Sfs, d, [](double, int32_t) { return 0; }, int(RoundNear), 0);
}

// Round-to-nearest conversions give ties to even whatever rounding mode the
// caller has set, and leave that mode and the caller's raised flags as they
// were.  With the invalid exception unmasked, values the rule saturates do
// not trap.
TEST_P(VecInit, FloatToIntegerKeepsTheCallersFloatingPointState) {
    std::feraiseexcept(FE_INVALID), std::fesetround(FE_UPWARD);
    expectEach(z().zorsConvert_32f32s_Sfs, narrowSources<float>(8, 35000), narrowed(RoundNear, 0), int(RoundNear), 0);
    volatile float one = 1.0f, tiny = 0x1p-25f;  // their sum rounds up where float arithmetic still rounds upward
    const bool kept = std::fegetround() == FE_UPWARD && one + tiny > 1.0f && std::fetestexcept(FE_INVALID);
    std::fesetround(FE_TONEAREST);
    EXPECT_TRUE(kept);
#if defined(__GLIBC__)
    std::vector<float> big(64, 2.5f);
    big[50] = 3e9f, big[41] = -1e30f, feenableexcept(FE_INVALID);
    expectEach(z().zorsConvert_32f16s_Sfs, big, narrowed(RoundNear, 0), int(RoundNear), 0);
    fedisableexcept(FE_INVALID);
#endif
}

ZT_ALL_VARIANTS(VecInit);
