// Vector zero, set, copy and conversions, on every variant's entries.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/guarded.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecInit : public zt::VariantTest {};
using zt::Api;
using zt::Case;

const float kNaN = std::numeric_limits<float>::quiet_NaN();
const float kInf = std::numeric_limits<float>::infinity();

struct Bits128 { uint64_t lo, hi; };
template <size_t N> struct BitsOf;
template <> struct BitsOf<1> { using type = uint8_t; };
template <> struct BitsOf<2> { using type = uint16_t; };
template <> struct BitsOf<4> { using type = uint32_t; };
template <> struct BitsOf<8> { using type = uint64_t; };
template <> struct BitsOf<16> { using type = Bits128; };

// Set with val's exact bytes, checked at an unaligned address on lengths
// that end 0 to 63 bytes into a 64-byte block, the bytes around left alone.
// On 32-bit x86 a float argument could pass through an x87 register in the
// caller (quieting a signalling NaN); an integer of the same size travels
// the same way on the stack.
template <class T, class B>
void expectSetStoresBits(Status(ZOR_CALL* set)(T, T*, int), const B& bits) {
    static_assert(sizeof(T) == sizeof(B));
#if defined(__i386__)
    typename BitsOf<sizeof(T)>::type arg;
    const auto call = reinterpret_cast<Status(ZOR_CALL*)(decltype(arg), T*, int)>(set);
#else
    T arg;
    const auto call = set;
#endif
    std::memcpy(&arg, &bits, sizeof arg);
    for (int n : {5, 63}) {
        std::vector<uint8_t> buf((n + 2) * sizeof(T) + 1, 0xA5), want = buf;
        for (int i = 1; i <= n; ++i) std::memcpy(want.data() + i * sizeof(T) + 1, &bits, sizeof(T));
        ASSERT_EQ(call(arg, reinterpret_cast<T*>(buf.data() + sizeof(T) + 1), n), StatusOk);
        EXPECT_EQ(buf, want) << n;
    }
}

// The exact scaled value, then nearest-even (or truncation), then clamped;
// NaN to the lowest value of a signed type and to 0 of an unsigned one.
template <class D>
D expectNarrow(double src, int rndMode, int scaleFactor) {
    using L = std::numeric_limits<D>;
    const double x = src * std::ldexp(1.0, -scaleFactor);  // tests keep this exact
    if (std::isnan(x)) return std::is_signed_v<D> ? L::min() : D(0);
    const double r = rndMode == RoundNear ? std::nearbyint(x) : std::trunc(x);
    return r >= double(L::max()) ? L::max() : r <= double(L::min()) ? L::min() : static_cast<D>(r);
}

// Ties, bounds and specials of every destination type, then random values
// (a third of them ties) over [-range, range].
template <class S>
std::vector<S> narrowSources(std::mt19937& rng, double range) {
    std::vector<S> v = {S(0), S(-0.0), S(0.5), S(-0.5), S(1.5), S(-1.5), S(2.5), S(-2.5), S(3.5),
                        S(0.49999997), S(-0.49999997), S(127.5), S(128.5), S(-128.5), S(-127.5),
                        S(255.5), S(254.5), S(255.4), S(-3.7), S(32766.5), S(32767.5), S(-32768.5),
                        S(-32767.5), S(65534.5), S(65535.5), S(65536), S(2147483520.0),
                        S(2147483648.0), S(-2147483648.0), S(-2147483904.0), S(1e30), S(-1e30),
                        S(kNaN), S(-kNaN), S(kInf), S(-kInf), S(40000.0), S(-40000.0)};
    std::uniform_real_distribution<double> u(-range, range);
    for (int i = 0; i < 400; ++i) v.push_back(S(i % 3 ? u(rng) : std::floor(u(rng)) + 0.5));
    return v;
}

}  // namespace

TEST_P(VecInit, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    uint8_t src[64] = {1, 2, 3}, dst[64] = {};
    const std::vector<zt::Watch> w{zt::watch(dst, sizeof dst)};
    const auto* cf = reinterpret_cast<const Complex64f*>(src);
    auto* df = reinterpret_cast<Complex64f*>(dst);
    // Every member goes through one of these templates.
    zt::expectChecks(z.zorsZero_16s, {reinterpret_cast<int16_t*>(dst), 8}, w, zt::eachNull(), zt::badLength<1>());
    zt::expectChecks(z.zorsSet_64fc, {Complex64f{1, 2}, df, 4}, w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z.zorsCopy_64fc, {cf, df, 4}, w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z.zorsConvert_32s64f, {reinterpret_cast<const int32_t*>(src), reinterpret_cast<double*>(dst), 8},
                     w, zt::eachNull(), zt::badLength<2>());
    zt::expectChecks(z.zorsConvert_32f16s_Sfs,
                     {reinterpret_cast<const float*>(src), reinterpret_cast<int16_t*>(dst), 8, int(RoundNear), -2}, w,
                     zt::eachNull(), zt::badLength<2>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<2>(std::numeric_limits<int>::min())));
}

// Zero clears exactly its elements; set stores the caller's bits (a
// signalling NaN stays signalling, complex parts stay in their places); copy
// is a byte copy that tolerates overlap in both directions.
TEST_P(VecInit, ZeroSetAndCopyMoveBytes) {
    const Api& z = this->z();
    std::vector<int16_t> h(40, -1);
    ASSERT_EQ(z.zorsZero_16s(h.data() + 1, 37), StatusOk);  // odd address, odd length
    for (int i = 0; i < 40; ++i) EXPECT_EQ(h[i], i == 0 || i > 37 ? -1 : 0) << i;
    std::vector<Complex64f> c(5, Complex64f{-0.0, 1});
    ASSERT_EQ(z.zorsZero_64fc(c.data(), 4), StatusOk);
    EXPECT_TRUE(std::signbit(c[4].re) && !std::signbit(c[3].re) && c[3].im == 0.0);

    expectSetStoresBits(z.zorsSet_8u, uint8_t(0x81));
    expectSetStoresBits(z.zorsSet_16s, int16_t(-2));
    expectSetStoresBits(z.zorsSet_32s, int32_t(-123456789));
    expectSetStoresBits(z.zorsSet_64s, INT64_C(-0x123456789abcdef));
    for (uint32_t bits : {0x7f800001u, 0xffa00000u, 0x80000000u, 0x00000001u})
        expectSetStoresBits(z.zorsSet_32f, bits);  // signalling NaNs, -0, a denormal
    expectSetStoresBits(z.zorsSet_64f, UINT64_C(0x7ff0000000000001));
    expectSetStoresBits(z.zorsSet_16sc, Complex16s{-32768, 32767});
    expectSetStoresBits(z.zorsSet_32sc, Complex32s{INT32_MIN, 7});
    expectSetStoresBits(z.zorsSet_32fc, UINT64_C(0x40200000ff800005));  // {signalling NaN, 2.5}
    expectSetStoresBits(z.zorsSet_64sc, Complex64s{INT64_MIN, INT64_MAX});
    expectSetStoresBits(z.zorsSet_64fc, Bits128{UINT64_C(0xfff0000000000002), UINT64_C(0x8000000000000000)});

    std::vector<uint32_t> s(40), d(40, 7);
    for (int i = 0; i < 40; ++i) s[i] = 0x7f800001u + i;  // signalling NaNs travel unchanged
    ASSERT_EQ(z.zorsCopy_32f(reinterpret_cast<float*>(s.data()), reinterpret_cast<float*>(d.data()), 39), StatusOk);
    EXPECT_TRUE(std::equal(s.begin(), s.begin() + 39, d.begin()) && d[39] == 7);
    for (int shift : {3, -3}) {
        std::vector<int16_t> v(40);
        for (int i = 0; i < 40; ++i) v[i] = int16_t(i);
        ASSERT_EQ(z.zorsCopy_16s(v.data() + (shift < 0 ? 3 : 0), v.data() + (shift > 0 ? 3 : 0), 30), StatusOk);
        for (int i = 0; i < 40; ++i) ASSERT_EQ(v[i], shift > 0 ? (i < 3 || i >= 33 ? i : i - 3) : (i < 30 ? i + 3 : i));
    }
}

namespace {
// fn(src, d, n, a...) against ref(src[i], D()) element by element, on all
// of src and on all but its first element (another tail, another address),
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
template <class S>
std::vector<S> everyValue() {
    std::vector<S> v;
    for (int64_t x = std::numeric_limits<S>::min(); x <= std::numeric_limits<S>::max(); ++x) v.push_back(S(x));
    return v;
}
// The value converted exactly.
const auto exact = [](auto v, auto d) { return static_cast<decltype(d)>(v); };
}  // namespace

// 8- and 16-bit sources exactly, every value; 32-bit ones rounded to the
// nearest float (ties to even) or saturated to 16 bits.
TEST_P(VecInit, WideningIsExactOrRoundsOnce) {
    const Api& z = this->z();
    expectEach(z.zorsConvert_8s16s, everyValue<int8_t>(), exact);
    expectEach(z.zorsConvert_8u32f, everyValue<uint8_t>(), exact);
    expectEach(z.zorsConvert_8s32f, everyValue<int8_t>(), exact);
    expectEach(z.zorsConvert_16s32s, everyValue<int16_t>(), exact);
    expectEach(z.zorsConvert_16s32f, everyValue<int16_t>(), exact);
    expectEach(z.zorsConvert_16u32f, everyValue<uint16_t>(), exact);
    std::mt19937 rng(11);
    std::vector<int32_t> v = {0, 1, -1, 16777217, 16777219, -16777219, INT32_MAX, INT32_MIN, INT32_MAX - 64,
                              INT32_MAX - 63, 32767, 32768, -32768, -32769};
    for (int i = 0; i < 300; ++i) v.push_back(int32_t(rng()) >> (rng() % 32));
    expectEach(z.zorsConvert_32s32f, v, [](int32_t x, float) {
        volatile double d = x;  // then rounded once
        return float(d);
    });
    expectEach(z.zorsConvert_32s64f, v, exact);
    expectEach(z.zorsConvert_32s16s, v, [](int32_t x, int16_t) { return int16_t(std::clamp(x, -32768, 32767)); });
    const int32_t ties[3] = {16777217, 16777219, -16777221};
    float f[3];
    ASSERT_EQ(z.zorsConvert_32s32f(ties, f, 3), StatusOk);
    EXPECT_TRUE(f[0] == 16777216.0f && f[1] == 16777220.0f && f[2] == -16777220.0f);
}

TEST_P(VecInit, FloatToIntegerAgainstExactReference) {
    const Api& z = this->z();
    std::mt19937 rng(3);
    for (int mode : {int(RoundNear), int(RoundZero), 7}) {
        for (int sf : {0, 1, 5, -1, -9, 20, -20}) {
            const double r = std::ldexp(1.0, sf);
            const auto narrow = [mode, sf](double x, auto d) { return expectNarrow<decltype(d)>(x, mode, sf); };
            expectEach(z.zorsConvert_32f8u_Sfs, narrowSources<float>(rng, 300 * r), narrow, mode, sf);
            expectEach(z.zorsConvert_32f8s_Sfs, narrowSources<float>(rng, 150 * r), narrow, mode, sf);
            expectEach(z.zorsConvert_32f16u_Sfs, narrowSources<float>(rng, 70000 * r), narrow, mode, sf);
            expectEach(z.zorsConvert_32f16s_Sfs, narrowSources<float>(rng, 35000 * r), narrow, mode, sf);
            expectEach(z.zorsConvert_32f32s_Sfs, narrowSources<float>(rng, 3e9 * r), narrow, mode, sf);
            expectEach(z.zorsConvert_64f32s_Sfs, narrowSources<double>(rng, 3e9 * r), narrow, mode, sf);
        }
    }
}

TEST_P(VecInit, FloatToIntegerPinnedCases) {
    const Api& z = this->z();
    // Half away from zero then back on odd exact ties, replayed on doubles:
    // 0.5 + 2^-53 sums to exactly 1.0, odd and equal to the sum, so back to 0.
    std::vector<double> d(37, std::nextafter(0.5, 1.0));
    d[5] = std::nextafter(1.5, 2.0);
    d[6] = -3.5;
    std::vector<int32_t> r(37);
    ASSERT_EQ(z.zorsConvert_64f32s_Sfs(d.data(), r.data(), 37, RoundNear, 0), StatusOk);
    for (int i = 0; i < 37; ++i) EXPECT_EQ(r[i], i == 5 ? 2 : i == 6 ? -4 : 0) << i;
    // Scale multipliers past the ends of the double range: halving past
    // 2^-1074 gives 0 (infinity times it is NaN: the lowest value), doubling
    // past 2^1023 gives infinity (0 times it is NaN too).
    const float src[20] = {kInf, -kInf, 0.0f, 3.0f, -3.0f, 1e-30f, kInf, 0.0f, 1.0f, -1.0f,
                           kInf, -kInf, 0.0f, 3.0f, -3.0f, 1e-30f, kInf, 0.0f, 1.0f, -1.0f};
    const struct { int sf; int16_t want[10]; } cases[] = {
        {1074, {32767, -32768, 0, 0, 0, 0, 32767, 0, 0, 0}},
        {1075, {-32768, -32768, 0, 0, 0, 0, -32768, 0, 0, 0}},
        {std::numeric_limits<int>::max(), {-32768, -32768, 0, 0, 0, 0, -32768, 0, 0, 0}},
        {-1023, {32767, -32768, 0, 32767, -32768, 32767, 32767, 0, 32767, -32768}},
        {std::numeric_limits<int>::min(), {32767, -32768, -32768, 32767, -32768, 32767, 32767, -32768, 32767, -32768}},
    };
    int16_t s16[20];
    for (const auto& c : cases) {
        ASSERT_EQ(z.zorsConvert_32f16s_Sfs(src, s16, 20, RoundZero, c.sf), StatusOk);
        for (int i = 0; i < 20; ++i) EXPECT_EQ(s16[i], c.want[i % 10]) << "sf " << c.sf << " at " << i;
    }
    uint8_t u[20];
    ASSERT_EQ(z.zorsConvert_32f8u_Sfs(src, u, 20, RoundNear, 1075), StatusOk);
    EXPECT_EQ(u[0], 0);  // NaN to 0 for unsigned
}

// The narrow destinations convert without a clamp unless a block holds a
// value at or above 2^31 (or a NaN): each such value alone among ordinary
// ones, in every lane of a 16-element block.
TEST_P(VecInit, LoneValueNearTwoToThe31) {
    const Api& z = this->z();
    const auto near = [](double x, auto d) { return expectNarrow<decltype(d)>(x, RoundNear, 0); };
    const auto zero = [](double x, auto d) { return expectNarrow<decltype(d)>(x, RoundZero, 0); };
    for (float probe : {2147483648.0f, std::nextafter(2147483648.0f, 0.0f), 3e9f, kInf, kNaN, -kNaN, -3e9f}) {
        for (int at = 0; at < 16; ++at) {
            SCOPED_TRACE(testing::Message() << probe << " at " << at);
            std::vector<float> src(32, -7.0f);
            src[16 + at] = probe;
            expectEach(z.zorsConvert_32f8u_Sfs, src, near, int(RoundNear), 0);
            expectEach(z.zorsConvert_32f16s_Sfs, src, zero, int(RoundZero), 0);
        }
    }
}

// Round-to-nearest conversions give ties to even whatever rounding mode the
// caller has set, and leave that mode and the caller's raised flags as they
// were; values the rule saturates raise nothing.
TEST_P(VecInit, FloatToIntegerKeepsTheCallersFloatingPointState) {
    const Api& z = this->z();
    std::mt19937 rng(8);
    std::vector<float> src = narrowSources<float>(rng, 35000);
    const int n = static_cast<int>(src.size());
    std::vector<int32_t> d(n);
    for (int fe : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        std::feclearexcept(FE_ALL_EXCEPT);
        std::feraiseexcept(FE_INVALID);
        ASSERT_EQ(std::fesetround(fe), 0);
        const Status s = z.zorsConvert_32f32s_Sfs(src.data(), d.data(), n, RoundNear, 0);
        const int after = std::fegetround();
        const bool invalidKept = std::fetestexcept(FE_INVALID) != 0;
        std::fesetround(FE_TONEAREST);
        ASSERT_EQ(s, StatusOk);
        EXPECT_TRUE(after == fe && invalidKept);
        for (int i = 0; i < n; ++i) ASSERT_EQ(d[i], expectNarrow<int32_t>(src[i], RoundNear, 0)) << fe << " " << src[i];
    }
    // Values the rule saturates raise nothing; with the invalid exception
    // unmasked they do not trap either.
    src.assign(64, 2.5f);
    src[50] = 3e9f;
    std::vector<int16_t> s16(64);
    std::feclearexcept(FE_ALL_EXCEPT);
    ASSERT_EQ(z.zorsConvert_32f16s_Sfs(src.data(), s16.data(), 64, RoundNear, 0), StatusOk);
    EXPECT_FALSE(std::fetestexcept(FE_INVALID));
#if defined(__GLIBC__)
    src[41] = -1e30f;
    feenableexcept(FE_INVALID);
    const Status s = z.zorsConvert_32f16s_Sfs(src.data(), s16.data(), 64, RoundNear, 0);
    fedisableexcept(FE_INVALID);
    ASSERT_EQ(s, StatusOk);
    EXPECT_EQ(s16[41], -32768);
#endif
    EXPECT_TRUE(s16[50] == 32767 && s16[0] == 2);
}

ZT_ALL_VARIANTS(VecInit);
