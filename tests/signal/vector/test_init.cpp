// Vector zero, set, copy and conversions, on every variant's entries.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class VecInit : public zt::VariantTest {};
class VecConvert : public zt::VariantTest {};

constexpr uint8_t kFill = 0xA5;

// A vector of n elements of T flush against a guard page (after or before),
// its bytes preset to kFill.
template <class T>
struct Guarded {
    zt::GuardedBuffer buf;
    int n;
    Guarded(int count, zt::Guard where = zt::Guard::After)
        : buf(sizeof(T) * (count > 0 ? count : 0), where), n(count) {
        std::memset(buf.data(), kFill, buf.size());
    }
    T* p() const { return buf.as<T>(); }
    T& operator[](int i) const { return p()[i]; }
    bool untouched() const {
        for (size_t i = 0; i < buf.size(); ++i)
            if (buf.data()[i] != kFill) return false;
        return true;
    }
};

template <class T>
bool sameBits(const T& a, const T& b) { return std::memcmp(&a, &b, sizeof(T)) == 0; }


const float kNaNf = std::numeric_limits<float>::quiet_NaN();
const float kInff = std::numeric_limits<float>::infinity();

// Lengths that reach every SIMD block size and tail.
const int kLengths[] = {1, 2, 3, 4, 5, 7, 8, 9, 15, 16, 17, 31, 32, 33, 63, 64, 65, 100};

}  // namespace

// ---- argument checks: one table for every member ------------------------------

// Every export of the family as (pointer-or-null, len) -> status.  The
// destination is a guarded buffer that must stay untouched on failure.
TEST_P(VecInit, ChecksComeInOrderAndWriteNothing) {
    const zt::Api& z = this->z();
    Guarded<uint8_t> src(64), dst(64);
    uint8_t* s = src.p();
    uint8_t* d = dst.p();
    std::memset(s, 0x11, 64);
    // (null source, null destination, len) -> status; hasSource tells
    // whether the first flag means anything.
    struct Call {
        const char* name;
        bool hasSource;
        std::function<Status(bool, bool, int)> f;
    };
    std::vector<Call> calls;
#define ZT_ONE(name, D, ...) \
    calls.push_back({#name, false, [&](bool, bool nd, int n) { return z.zors##name(__VA_ARGS__ nd ? nullptr : (D*)d, n); }})
#define ZT_TWO(name, S, D, ...)                                                                 \
    calls.push_back({#name, true, [&](bool ns, bool nd, int n) {                                 \
        return z.zors##name(ns ? nullptr : (const S*)s, nd ? nullptr : (D*)d, n __VA_ARGS__); \
    }})
    ZT_ONE(Zero_8u, uint8_t);
    ZT_ONE(Zero_16s, int16_t);
    ZT_ONE(Zero_16sc, Complex16s);
    ZT_ONE(Zero_32f, float);
    ZT_ONE(Zero_32fc, Complex32f);
    ZT_ONE(Zero_64f, double);
    ZT_ONE(Zero_64fc, Complex64f);
    ZT_ONE(Set_8u, uint8_t, 1,);
    ZT_ONE(Set_16s, int16_t, 1,);
    ZT_ONE(Set_32s, int32_t, 1,);
    ZT_ONE(Set_64s, int64_t, 1,);
    ZT_ONE(Set_32f, float, 1.0f,);
    ZT_ONE(Set_64f, double, 1.0,);
    ZT_ONE(Set_16sc, Complex16s, Complex16s{1, 2},);
    ZT_ONE(Set_32sc, Complex32s, Complex32s{1, 2},);
    ZT_ONE(Set_32fc, Complex32f, Complex32f{1, 2},);
    ZT_ONE(Set_64sc, Complex64s, Complex64s{1, 2},);
    ZT_ONE(Set_64fc, Complex64f, Complex64f{1, 2},);
    ZT_TWO(Copy_8u, uint8_t, uint8_t);
    ZT_TWO(Copy_16s, int16_t, int16_t);
    ZT_TWO(Copy_16sc, Complex16s, Complex16s);
    ZT_TWO(Copy_32f, float, float);
    ZT_TWO(Copy_32fc, Complex32f, Complex32f);
    ZT_TWO(Copy_64f, double, double);
    ZT_TWO(Copy_64fc, Complex64f, Complex64f);
    ZT_TWO(Convert_8s16s, int8_t, int16_t);
    ZT_TWO(Convert_16s32s, int16_t, int32_t);
    ZT_TWO(Convert_8u32f, uint8_t, float);
    ZT_TWO(Convert_8s32f, int8_t, float);
    ZT_TWO(Convert_16s32f, int16_t, float);
    ZT_TWO(Convert_16u32f, uint16_t, float);
    ZT_TWO(Convert_32s32f, int32_t, float);
    ZT_TWO(Convert_32s64f, int32_t, double);
    ZT_TWO(Convert_32s16s, int32_t, int16_t);
    ZT_TWO(Convert_32f8u_Sfs, float, uint8_t, , RoundNear, 0);
    ZT_TWO(Convert_32f8s_Sfs, float, int8_t, , RoundNear, 0);
    ZT_TWO(Convert_32f16u_Sfs, float, uint16_t, , RoundNear, 0);
    ZT_TWO(Convert_32f16s_Sfs, float, int16_t, , RoundNear, 0);
    ZT_TWO(Convert_32f32s_Sfs, float, int32_t, , RoundZero, 3);
    ZT_TWO(Convert_64f32s_Sfs, double, int32_t, , RoundNear, -2);
#undef ZT_ONE
#undef ZT_TWO
    ASSERT_EQ(calls.size(), 40u);
    for (const Call& c : calls) {
        SCOPED_TRACE(c.name);
        EXPECT_EQ(c.f(false, true, 0), StatusNullPointer);  // the pointer check comes first
        if (c.hasSource) {
            EXPECT_EQ(c.f(true, false, -1), StatusNullPointer);
            EXPECT_EQ(c.f(true, true, 5), StatusNullPointer);
        }
        EXPECT_EQ(c.f(false, false, 0), StatusBadSize);
        EXPECT_EQ(c.f(false, false, -7), StatusBadSize);
        EXPECT_EQ(c.f(false, false, std::numeric_limits<int>::min()), StatusBadSize);
        EXPECT_TRUE(dst.untouched());
        EXPECT_EQ(c.f(false, false, 1), StatusOk);
        EXPECT_FALSE(dst.untouched());
        std::memset(d, kFill, 64);
    }
}

// ---- zero, set, copy ------------------------------------------------------------

TEST_P(VecInit, ZeroClearsExactlyTheElements) {
    for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
        for (int n : kLengths) {
            Guarded<Complex64f> d(n, where);
            ASSERT_EQ(z().zorsZero_64fc(d.p(), n), StatusOk);
            for (size_t i = 0; i < d.buf.size(); ++i) ASSERT_EQ(d.buf.data()[i], 0) << n;
            Guarded<int16_t> h(n + 1, where);
            ASSERT_EQ(z().zorsZero_16s(h.p() + 1, n), StatusOk);  // odd address, odd length
            EXPECT_EQ(h.buf.data()[0], kFill);
            EXPECT_EQ(h.buf.data()[1], kFill);
            for (int i = 1; i <= n; ++i) ASSERT_EQ(h[i], 0);
        }
    }
    Guarded<uint8_t> b(5);
    ASSERT_EQ(z().zorsZero_8u(b.p(), 5), StatusOk);
    Guarded<float> f(5);
    ASSERT_EQ(z().zorsZero_32f(f.p(), 5), StatusOk);
    EXPECT_FALSE(std::signbit(f[4]));
    Guarded<Complex16s> c16(3);
    ASSERT_EQ(z().zorsZero_16sc(c16.p(), 3), StatusOk);
    EXPECT_EQ(c16[2].im, 0);
    Guarded<Complex32f> c32(3);
    ASSERT_EQ(z().zorsZero_32fc(c32.p(), 3), StatusOk);
    Guarded<double> d64(3);
    ASSERT_EQ(z().zorsZero_64f(d64.p(), 3), StatusOk);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(b[i], 0);
    for (int i = 0; i < 3; ++i) EXPECT_TRUE(c32[i].re == 0 && c32[i].im == 0 && d64[i] == 0);
}

// Set stores the caller's bits: a signalling NaN stays signalling, a
// negative zero stays negative, complex parts stay in their places.

// The value of type T whose bytes are b (T and B of one size), built in
// memory: returning a float through the x87 stack would quiet a
// signalling NaN before the library ever saw it.
template <class T, class B>
void fromBits(T& out, const B& b) {
    static_assert(sizeof(T) == sizeof(B));
    std::memcpy(&out, &b, sizeof(T));
}

struct Bits128 { uint64_t lo, hi; };
template <size_t N> struct BitsOf;
template <> struct BitsOf<1> { using type = uint8_t; };
template <> struct BitsOf<2> { using type = uint16_t; };
template <> struct BitsOf<4> { using type = uint32_t; };
template <> struct BitsOf<8> { using type = uint64_t; };
template <> struct BitsOf<16> { using type = Bits128; };

// Calls set with val's exact bytes.  On 32-bit x86 a float argument could
// pass through an x87 register in the caller; an integer of the same size
// travels the same way on the stack and keeps every bit.
template <class T>
Status callSet(Status(ZOR_CALL* set)(T, T*, int), const T& val, T* p, int n) {
#if defined(__i386__)
    using B = typename BitsOf<sizeof(T)>::type;
    B bits;
    std::memcpy(&bits, &val, sizeof bits);
    return reinterpret_cast<Status(ZOR_CALL*)(B, T*, int)>(set)(bits, p, n);
#else
    return set(val, p, n);
#endif
}

template <class T>
void checkSet(Status(ZOR_CALL* set)(T, T*, int), const T& val) {
    for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
        for (int n : kLengths) {
            // one element of slack in front: the destination starts unaligned
            Guarded<T> d(n + 1, where);
            uint8_t* base = reinterpret_cast<uint8_t*>(d.p());
            T* p = reinterpret_cast<T*>(base + (where == zt::Guard::After ? sizeof(T) : 0));
            ASSERT_EQ(callSet(set, val, p, n), StatusOk);
            for (int i = 0; i < n; ++i) ASSERT_TRUE(sameBits(p[i], val)) << "n " << n << " i " << i;
            const uint8_t* rest = where == zt::Guard::After ? base : base + n * sizeof(T);
            for (size_t k = 0; k < sizeof(T); ++k) ASSERT_EQ(rest[k], kFill);
        }
    }
}

TEST_P(VecInit, SetStoresTheValueBitsEverywhere) {
    const zt::Api& z = this->z();
    checkSet<uint8_t>(z.zorsSet_8u, 0x81);
    checkSet<int16_t>(z.zorsSet_16s, -2);
    checkSet<int32_t>(z.zorsSet_32s, -123456789);
    checkSet<int64_t>(z.zorsSet_64s, INT64_C(-0x123456789abcdef));
    float f;
    for (uint32_t bits : {0x7f800001u, 0xffa00000u, 0x80000000u, 0x00000001u, 0x3eaaaaabu}) {
        fromBits(f, bits);  // signalling NaNs, negative zero, a subnormal, 1/3
        checkSet<float>(z.zorsSet_32f, f);
    }
    double d;
    for (uint64_t bits : {UINT64_C(0x7ff0000000000001), UINT64_C(0x8000000000000000), UINT64_C(0x3fd5555555555555)}) {
        fromBits(d, bits);
        checkSet<double>(z.zorsSet_64f, d);
    }
    checkSet<Complex16s>(z.zorsSet_16sc, Complex16s{-32768, 32767});
    checkSet<Complex32s>(z.zorsSet_32sc, Complex32s{INT32_MIN, 7});
    Complex32f cf;
    fromBits(cf, UINT64_C(0x40200000ff800005));  // {signalling NaN, 2.5}
    checkSet<Complex32f>(z.zorsSet_32fc, cf);
    checkSet<Complex64s>(z.zorsSet_64sc, Complex64s{INT64_MIN, INT64_MAX});
    Complex64f cd;
    fromBits(cd, Bits128{UINT64_C(0xfff0000000000002), UINT64_C(0x8000000000000000)});
    checkSet<Complex64f>(z.zorsSet_64fc, cd);
}

TEST_P(VecInit, CopyIsAByteCopyAndToleratesOverlap) {
    std::mt19937 rng(7);
    for (int n : kLengths) {
        Guarded<float> s(n, zt::Guard::Before), d(n);
        for (size_t i = 0; i < s.buf.size(); ++i) s.buf.data()[i] = uint8_t(rng());
        fromBits(s[0], 0x7f800001u);  // a signalling NaN travels unchanged
        ASSERT_EQ(z().zorsCopy_32f(s.p(), d.p(), n), StatusOk);
        ASSERT_EQ(std::memcmp(s.p(), d.p(), n * sizeof(float)), 0);
        Guarded<Complex64f> s2(n), d2(n, zt::Guard::Before);
        for (size_t i = 0; i < s2.buf.size(); ++i) s2.buf.data()[i] = uint8_t(rng());
        ASSERT_EQ(z().zorsCopy_64fc(s2.p(), d2.p(), n), StatusOk);
        ASSERT_EQ(std::memcmp(s2.p(), d2.p(), n * sizeof(Complex64f)), 0);
    }
    // Each width once, and overlapping in both directions.
    std::vector<uint8_t> a(256), b(256);
    for (int i = 0; i < 256; ++i) a[i] = uint8_t(i);
    const zt::Api& z = this->z();
    EXPECT_EQ(z.zorsCopy_8u(a.data(), b.data(), 11), StatusOk);
    EXPECT_EQ(z.zorsCopy_16s((int16_t*)a.data(), (int16_t*)b.data(), 11), StatusOk);
    EXPECT_EQ(z.zorsCopy_16sc((Complex16s*)a.data(), (Complex16s*)b.data(), 11), StatusOk);
    EXPECT_EQ(z.zorsCopy_32fc((Complex32f*)a.data(), (Complex32f*)b.data(), 11), StatusOk);
    EXPECT_EQ(z.zorsCopy_64f((double*)a.data(), (double*)b.data(), 11), StatusOk);
    EXPECT_EQ(std::memcmp(a.data(), b.data(), 88), 0);
    std::vector<int16_t> v(40);
    for (int i = 0; i < 40; ++i) v[i] = int16_t(i);
    EXPECT_EQ(z.zorsCopy_16s(v.data(), v.data() + 3, 30), StatusOk);
    for (int i = 0; i < 30; ++i) ASSERT_EQ(v[i + 3], i);
    for (int i = 0; i < 40; ++i) v[i] = int16_t(i);
    EXPECT_EQ(z.zorsCopy_16s(v.data() + 3, v.data(), 30), StatusOk);
    for (int i = 0; i < 30; ++i) ASSERT_EQ(v[i], i + 3);
}

// ---- widening conversions ----------------------------------------------------------

namespace {

// Runs fn over src (n elements) into a guarded destination at an odd
// address and compares with ref element by element.
template <class S, class D, class F, class R>
void checkWiden(F fn, const std::vector<S>& src, R ref) {
    const int total = static_cast<int>(src.size());
    for (int n : {total, total - 1, total - 13}) {
        if (n < 1) continue;
        for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
            Guarded<S> s(n + 1, where);
            Guarded<D> d(n, where);
            S* sp = s.p() + (where == zt::Guard::Before ? 0 : 1);  // source unaligned in one of them
            std::memcpy(sp, src.data() + (total - n), n * sizeof(S));
            ASSERT_EQ(fn(sp, d.p(), n), StatusOk);
            for (int i = 0; i < n; ++i) {
                const D want = ref(sp[i]);
                ASSERT_TRUE(sameBits(d[i], want)) << "n " << n << " at " << i << " src " << +sp[i]
                                                  << " got " << +d[i] << " want " << +want;
            }
        }
    }
}

template <class S>
std::vector<S> everyValue() {
    std::vector<S> v;
    for (int64_t x = std::numeric_limits<S>::min(); x <= std::numeric_limits<S>::max(); ++x)
        v.push_back(static_cast<S>(x));
    return v;
}

}  // namespace

TEST_P(VecConvert, NarrowIntegerSourcesWidenExactly) {
    const zt::Api& z = this->z();
    checkWiden<int8_t, int16_t>(z.zorsConvert_8s16s, everyValue<int8_t>(), [](int8_t v) { return int16_t(v); });
    checkWiden<uint8_t, float>(z.zorsConvert_8u32f, everyValue<uint8_t>(), [](uint8_t v) { return float(int(v)); });
    checkWiden<int8_t, float>(z.zorsConvert_8s32f, everyValue<int8_t>(), [](int8_t v) { return float(int(v)); });
    checkWiden<int16_t, int32_t>(z.zorsConvert_16s32s, everyValue<int16_t>(), [](int16_t v) { return int32_t(v); });
    checkWiden<int16_t, float>(z.zorsConvert_16s32f, everyValue<int16_t>(), [](int16_t v) { return float(int(v)); });
    checkWiden<uint16_t, float>(z.zorsConvert_16u32f, everyValue<uint16_t>(), [](uint16_t v) { return float(int(v)); });
}

TEST_P(VecConvert, From32sRoundsOrSaturates) {
    const zt::Api& z = this->z();
    std::mt19937 rng(11);
    std::vector<int32_t> v = {0, 1, -1, 16777216, 16777217, 16777218, 16777219, -16777217, -16777219,
                              INT32_MAX, INT32_MIN, INT32_MAX - 64, INT32_MAX - 63, 32767, 32768,
                              -32768, -32769, 40000, -40000};
    for (int i = 0; i < 300; ++i) v.push_back(int32_t(rng()) >> (rng() % 32));
    // 32s to 32f: nearest float, ties to even, checked against exact halves.
    checkWiden<int32_t, float>(z.zorsConvert_32s32f, v, [](int32_t x) {
        const int64_t a = x < 0 ? -int64_t(x) : int64_t(x);
        int shift = 0;
        while ((a >> shift) >= (int64_t(1) << 24)) ++shift;
        int64_t q = a >> shift;
        const int64_t rem = a - (q << shift), half = shift ? int64_t(1) << (shift - 1) : 1;
        if (shift && (rem > half || (rem == half && (q & 1)))) ++q;
        const float m = std::ldexp(float(q), shift);
        return x < 0 ? -m : m;
    });
    checkWiden<int32_t, double>(z.zorsConvert_32s64f, v, [](int32_t x) { return double(x); });
    checkWiden<int32_t, int16_t>(z.zorsConvert_32s16s, v, [](int32_t x) {
        return int16_t(x > 32767 ? 32767 : x < -32768 ? -32768 : x);
    });
    float f[3];
    const int32_t ties[3] = {16777217, 16777219, -16777221};
    ASSERT_EQ(z.zorsConvert_32s32f(ties, f, 3), StatusOk);
    EXPECT_EQ(f[0], 16777216.0f);
    EXPECT_EQ(f[1], 16777220.0f);
    EXPECT_EQ(f[2], -16777220.0f);
    int16_t h[2];
    const int32_t big[2] = {40000, -40000};
    ASSERT_EQ(z.zorsConvert_32s16s(big, h, 2), StatusOk);
    EXPECT_EQ(h[0], 32767);
    EXPECT_EQ(h[1], -32768);
}

// ---- float to integer -----------------------------------------------------------------

namespace {

// Expected conversion, computed independently: the exact scaled value, then
// nearest-even (or truncation), then clamped; NaN to the lowest value of a
// signed type and to 0 of an unsigned one.
template <class D>
D expectNarrow(double src, int rndMode, int scaleFactor) {
    using L = std::numeric_limits<D>;
    double x = src;
    if (scaleFactor != 0) x = src * std::ldexp(1.0, -scaleFactor);  // tests keep this exact
    if (std::isnan(x)) return std::is_signed_v<D> ? L::min() : D(0);
    const double r = rndMode == RoundNear ? std::nearbyint(x) : std::trunc(x);
    if (r >= double(L::max())) return L::max();
    if (r <= double(L::min())) return L::min();
    return static_cast<D>(r);
}

template <class S>
std::vector<S> specialSources(std::mt19937& rng, double range) {
    std::vector<S> v = {S(0), S(-0.0), S(0.5), S(-0.5), S(1.5), S(-1.5), S(2.5), S(-2.5), S(3.5),
                        S(0.49999997), S(-0.49999997), S(127.5), S(128.5), S(-128.5), S(-127.5),
                        S(255.5), S(254.5), S(255.4), S(-3.7), S(32766.5), S(32767.5), S(-32768.5),
                        S(-32767.5), S(65534.5), S(65535.5), S(65536), S(2147483520.0),
                        S(2147483648.0), S(-2147483648.0), S(-2147483904.0), S(1e30), S(-1e30),
                        S(kNaNf), S(-kNaNf), S(kInff), S(-kInff), S(40000.0), S(-40000.0)};
    std::uniform_real_distribution<double> u(-range, range);
    for (int i = 0; i < 400; ++i) {
        double x = u(rng);
        if (i % 3 == 0) x = std::floor(x) + 0.5;  // ties
        if (i % 7 == 0) x = std::floor(x);
        v.push_back(S(x));
    }
    return v;
}

template <class S, class D, class F>
void checkNarrow(F fn, const std::vector<S>& src, int rndMode, int scaleFactor) {
    const int n = static_cast<int>(src.size());
    for (int off : {0, 1, 3}) {
        const int m = n - off;
        Guarded<S> s(m, zt::Guard::Before);
        Guarded<D> d(m);
        std::memcpy(s.p(), src.data() + off, m * sizeof(S));
        ASSERT_EQ(fn(s.p(), d.p(), m, rndMode, scaleFactor), StatusOk);
        for (int i = 0; i < m; ++i)
            ASSERT_EQ(+d[i], +expectNarrow<D>(s[i], rndMode, scaleFactor))
                << "src " << s[i] << " mode " << rndMode << " scale " << scaleFactor << " at " << i;
    }
}

}  // namespace

TEST_P(VecConvert, FloatToIntegerAgainstExactReference) {
    const zt::Api& z = this->z();
    std::mt19937 rng(3);
    for (int mode : {int(RoundNear), int(RoundZero), 7, -1}) {
        for (int sf : {0, 1, 2, 5, -1, -2, -9, 20, -20}) {
            SCOPED_TRACE(testing::Message() << "mode " << mode << " scale " << sf);
            const double r = std::ldexp(1.0, sf);
            checkNarrow<float, uint8_t>(z.zorsConvert_32f8u_Sfs, specialSources<float>(rng, 300 * r), mode, sf);
            checkNarrow<float, int8_t>(z.zorsConvert_32f8s_Sfs, specialSources<float>(rng, 150 * r), mode, sf);
            checkNarrow<float, uint16_t>(z.zorsConvert_32f16u_Sfs, specialSources<float>(rng, 70000 * r), mode, sf);
            checkNarrow<float, int16_t>(z.zorsConvert_32f16s_Sfs, specialSources<float>(rng, 35000 * r), mode, sf);
            checkNarrow<float, int32_t>(z.zorsConvert_32f32s_Sfs, specialSources<float>(rng, 3e9 * r), mode, sf);
            checkNarrow<double, int32_t>(z.zorsConvert_64f32s_Sfs, specialSources<double>(rng, 3e9 * r), mode, sf);
        }
    }
}

TEST_P(VecConvert, FloatToIntegerDocumentedCases) {
    const zt::Api& z = this->z();
    auto to16s = [&](float v, int mode, int sf) {
        int16_t out = 0x5a5a;
        EXPECT_EQ(z.zorsConvert_32f16s_Sfs(&v, &out, 1, mode, sf), StatusOk);
        return int(out);
    };
    EXPECT_EQ(to16s(0.5f, RoundNear, 0), 0);
    EXPECT_EQ(to16s(1.5f, RoundNear, 0), 2);
    EXPECT_EQ(to16s(-1.5f, RoundNear, 0), -2);
    EXPECT_EQ(to16s(-2.5f, RoundNear, 0), -2);
    EXPECT_EQ(to16s(32766.6f, RoundNear, 0), 32767);
    EXPECT_EQ(to16s(40000.0f, RoundNear, 0), 32767);
    EXPECT_EQ(to16s(-40000.0f, RoundNear, 0), -32768);
    EXPECT_EQ(to16s(kNaNf, RoundNear, 0), -32768);
    EXPECT_EQ(to16s(kNaNf, RoundZero, 3), -32768);
    EXPECT_EQ(to16s(5.0f, RoundNear, 1), 2);
    EXPECT_EQ(to16s(5.0f, RoundZero, 1), 2);
    EXPECT_EQ(to16s(7.0f, RoundNear, 1), 4);
    EXPECT_EQ(to16s(3.3f, RoundNear, -2), 13);
    EXPECT_EQ(to16s(-2.7f, 7, 0), -2);  // any mode but RoundNear truncates
    EXPECT_EQ(to16s(-2.7f, RoundNear, 0), -3);

    uint8_t u8[2];
    const float f8[2] = {-3.7f, 255.4f};
    ASSERT_EQ(z.zorsConvert_32f8u_Sfs(f8, u8, 2, RoundNear, 0), StatusOk);
    EXPECT_EQ(u8[0], 0);
    EXPECT_EQ(u8[1], 255);

    // NaN: the lowest value of signed types, 0 of unsigned ones, in both modes.
    for (int mode : {int(RoundNear), int(RoundZero)}) {
        const float nan = kNaNf;
        uint8_t a;
        int8_t b;
        uint16_t c;
        int32_t e;
        ASSERT_EQ(z.zorsConvert_32f8u_Sfs(&nan, &a, 1, mode, 0), StatusOk);
        ASSERT_EQ(z.zorsConvert_32f8s_Sfs(&nan, &b, 1, mode, 0), StatusOk);
        ASSERT_EQ(z.zorsConvert_32f16u_Sfs(&nan, &c, 1, mode, 0), StatusOk);
        ASSERT_EQ(z.zorsConvert_32f32s_Sfs(&nan, &e, 1, mode, 0), StatusOk);
        EXPECT_EQ(a, 0);
        EXPECT_EQ(b, -128);
        EXPECT_EQ(c, 0);
        EXPECT_EQ(e, INT32_MIN);
        const double dn = std::numeric_limits<double>::quiet_NaN();
        ASSERT_EQ(z.zorsConvert_64f32s_Sfs(&dn, &e, 1, mode, 4), StatusOk);
        EXPECT_EQ(e, INT32_MIN);
    }
}

// The 32s bound: unscaled floats compare with 2^31 (the float nearest to
// 2147483647); scaled values with 2147483647 itself.
TEST_P(VecConvert, Float32sBoundDependsOnScale) {
    const zt::Api& z = this->z();
    const float f[4] = {2147483520.0f, 2147483648.0f, -2147483648.0f, -2147483904.0f};
    int32_t out[4];
    for (int mode : {int(RoundNear), int(RoundZero)}) {
        ASSERT_EQ(z.zorsConvert_32f32s_Sfs(f, out, 4, mode, 0), StatusOk);
        EXPECT_EQ(out[0], 2147483520);
        EXPECT_EQ(out[1], INT32_MAX);
        EXPECT_EQ(out[2], INT32_MIN);
        EXPECT_EQ(out[3], INT32_MIN);
    }
    const float g[2] = {1073741760.0f * 2, 4294967296.0f};
    ASSERT_EQ(z.zorsConvert_32f32s_Sfs(g, out, 2, RoundNear, -1), StatusOk);
    EXPECT_EQ(out[0], INT32_MAX);
    EXPECT_EQ(out[1], INT32_MAX);
    ASSERT_EQ(z.zorsConvert_32f32s_Sfs(g, out, 2, RoundNear, 1), StatusOk);
    EXPECT_EQ(out[0], 1073741760);
    EXPECT_EQ(out[1], INT32_MAX);  // 2^32 halved is 2^31, above 2147483647
    const double d[3] = {2147483646.5, 2147483647.0, -2147483648.5};
    ASSERT_EQ(z.zorsConvert_64f32s_Sfs(d, out, 3, RoundNear, 0), StatusOk);
    EXPECT_EQ(out[0], 2147483646);
    EXPECT_EQ(out[1], INT32_MAX);
    EXPECT_EQ(out[2], INT32_MIN);
}

// The narrow destinations convert without a clamp unless a block holds a
// value at or above 2^31: each such value (and the float just below) alone
// among ordinary ones, in every lane of a 16-element block.
TEST_P(VecConvert, LoneValueNearTwoToThe31) {
    const zt::Api& z = this->z();
    const float probes[] = {2147483648.0f, std::nextafter(2147483648.0f, 0.0f), 3e9f, kInff, kNaNf, -kNaNf, -3e9f};
    for (float probe : probes) {
        for (int at = 0; at < 16; ++at) {
            std::vector<float> src(32, -7.0f);
            src[16 + at] = probe;
            SCOPED_TRACE(testing::Message() << probe << " at " << at);
            for (int mode : {int(RoundNear), int(RoundZero)}) {
                std::vector<uint8_t> u8(32);
                std::vector<int8_t> s8(32);
                std::vector<uint16_t> u16(32);
                std::vector<int16_t> s16(32);
                ASSERT_EQ(z.zorsConvert_32f8u_Sfs(src.data(), u8.data(), 32, mode, 0), StatusOk);
                ASSERT_EQ(z.zorsConvert_32f8s_Sfs(src.data(), s8.data(), 32, mode, 0), StatusOk);
                ASSERT_EQ(z.zorsConvert_32f16u_Sfs(src.data(), u16.data(), 32, mode, 0), StatusOk);
                ASSERT_EQ(z.zorsConvert_32f16s_Sfs(src.data(), s16.data(), 32, mode, 0), StatusOk);
                for (int i = 0; i < 32; ++i) {
                    ASSERT_EQ(u8[i], expectNarrow<uint8_t>(src[i], mode, 0)) << i;
                    ASSERT_EQ(s8[i], expectNarrow<int8_t>(src[i], mode, 0)) << i;
                    ASSERT_EQ(u16[i], expectNarrow<uint16_t>(src[i], mode, 0)) << i;
                    ASSERT_EQ(s16[i], expectNarrow<int16_t>(src[i], mode, 0)) << i;
                }
            }
        }
    }
}

// Round-to-nearest conversions give ties to even whatever rounding mode the
// caller has set, and leave that mode and the caller's raised flags as they
// were.
TEST_P(VecConvert, FloatToIntegerKeepsTheCallersFloatingPointState) {
    const zt::Api& z = this->z();
    std::mt19937 rng(8);
    const std::vector<float> src = specialSources<float>(rng, 35000);
    const int n = static_cast<int>(src.size());
    for (int fe : {FE_UPWARD, FE_DOWNWARD, FE_TOWARDZERO}) {
        for (int mode : {int(RoundNear), int(RoundZero)}) {
            std::vector<int16_t> s16(n);
            std::vector<uint8_t> u8(n);
            std::vector<int32_t> s32(n);
            std::feclearexcept(FE_ALL_EXCEPT);
            std::feraiseexcept(FE_INVALID);
            ASSERT_EQ(std::fesetround(fe), 0);
            const Status a = z.zorsConvert_32f16s_Sfs(src.data(), s16.data(), n, mode, 0);
            const Status b = z.zorsConvert_32f8u_Sfs(src.data(), u8.data(), n, mode, 0);
            const Status c = z.zorsConvert_32f32s_Sfs(src.data(), s32.data(), n, mode, 0);
            const int after = std::fegetround();
            const bool invalidKept = std::fetestexcept(FE_INVALID) != 0;
            std::fesetround(FE_TONEAREST);
            ASSERT_EQ(a, StatusOk);
            ASSERT_EQ(b, StatusOk);
            ASSERT_EQ(c, StatusOk);
            EXPECT_EQ(after, fe);
            EXPECT_TRUE(invalidKept);
            for (int i = 0; i < n; ++i) {
                ASSERT_EQ(s16[i], expectNarrow<int16_t>(src[i], mode, 0)) << fe << " " << src[i];
                ASSERT_EQ(u8[i], expectNarrow<uint8_t>(src[i], mode, 0)) << fe << " " << src[i];
                ASSERT_EQ(s32[i], expectNarrow<int32_t>(src[i], mode, 0)) << fe << " " << src[i];
            }
        }
    }
    // Values the rule saturates raise nothing; a flag raised before stays.
    std::vector<float> plain(100, 2.5f);
    plain[50] = 3e9f;
    std::vector<int16_t> out(100);
    for (bool raised : {false, true}) {
        std::feclearexcept(FE_ALL_EXCEPT);
        if (raised) std::feraiseexcept(FE_INVALID);
        ASSERT_EQ(z.zorsConvert_32f16s_Sfs(plain.data(), out.data(), 100, RoundNear, 0), StatusOk);
        EXPECT_EQ(std::fetestexcept(FE_INVALID) != 0, raised);
        EXPECT_EQ(out[50], 32767);
    }
    std::feclearexcept(FE_ALL_EXCEPT);
}

#if defined(__GLIBC__)
// A caller that unmasks the invalid-operation exception gets no trap from
// values the rule saturates (NaN aside, which is invalid in any case).
TEST_P(VecConvert, NoTrapWithTheInvalidExceptionUnmasked) {
    const zt::Api& z = this->z();
    std::vector<float> src(64, 7.0f);
    src[20] = 3e9f;
    src[41] = -1e30f;
    std::vector<int16_t> out(64);
    std::feclearexcept(FE_ALL_EXCEPT);
    feenableexcept(FE_INVALID);
    const Status s = z.zorsConvert_32f16s_Sfs(src.data(), out.data(), 64, RoundNear, 0);
    fedisableexcept(FE_INVALID);
    ASSERT_EQ(s, StatusOk);
    EXPECT_EQ(out[20], 32767);
    EXPECT_EQ(out[41], -32768);
    EXPECT_EQ(out[0], 7);
}
#endif

// The half-away-then-back rule, replayed on doubles: 0.5 + 2^-53 sums to
// exactly 1.0, which is odd and equal to the sum, so it steps back to 0.
TEST_P(VecConvert, DoubleSourceKeepsTheTieCorrection) {
    const zt::Api& z = this->z();
    std::vector<double> src(37, 0.0);
    const double justAbove = std::nextafter(0.5, 1.0);
    for (int i = 0; i < 37; ++i) src[i] = (i & 1) ? -justAbove : justAbove;
    src[5] = std::nextafter(1.5, 2.0);  // plain cases around it
    src[6] = 2.5;
    src[7] = -3.5;
    std::vector<int32_t> out(37, 99);
    ASSERT_EQ(z.zorsConvert_64f32s_Sfs(src.data(), out.data(), 37, RoundNear, 0), StatusOk);
    for (int i = 0; i < 37; ++i) {
        if (i >= 5 && i <= 7) continue;
        ASSERT_EQ(out[i], 0) << i;
    }
    EXPECT_EQ(out[5], 2);
    EXPECT_EQ(out[6], 2);
    EXPECT_EQ(out[7], -4);
}

// Scale multipliers at the ends of the double range: halving past 2^-1074
// gives 0 (so infinity times it is NaN: the lowest value), doubling past
// 2^1023 gives infinity (so 0 times it is NaN too).
TEST_P(VecConvert, ExtremeScaleFactors) {
    const zt::Api& z = this->z();
    const float src[20] = {kInff, -kInff, 0.0f, 3.0f, -3.0f, 1e-30f, kInff, 0.0f, 1.0f, -1.0f,
                           kInff, -kInff, 0.0f, 3.0f, -3.0f, 1e-30f, kInff, 0.0f, 1.0f, -1.0f};
    int16_t out[20];
    struct Case { int sf; int16_t want[10]; };
    const Case cases[] = {
        {1074, {32767, -32768, 0, 0, 0, 0, 32767, 0, 0, 0}},
        {1075, {-32768, -32768, 0, 0, 0, 0, -32768, 0, 0, 0}},
        {std::numeric_limits<int>::max(), {-32768, -32768, 0, 0, 0, 0, -32768, 0, 0, 0}},
        {-1023, {32767, -32768, 0, 32767, -32768, 32767, 32767, 0, 32767, -32768}},
        {-1024, {32767, -32768, -32768, 32767, -32768, 32767, 32767, -32768, 32767, -32768}},
        {std::numeric_limits<int>::min(), {32767, -32768, -32768, 32767, -32768, 32767, 32767, -32768, 32767, -32768}},
    };
    for (const Case& c : cases) {
        for (int mode : {int(RoundNear), int(RoundZero)}) {
            ASSERT_EQ(z.zorsConvert_32f16s_Sfs(src, out, 20, mode, c.sf), StatusOk);
            for (int i = 0; i < 20; ++i) EXPECT_EQ(out[i], c.want[i % 10]) << "sf " << c.sf << " at " << i;
        }
    }
    uint8_t u[20];
    ASSERT_EQ(z.zorsConvert_32f8u_Sfs(src, u, 20, RoundNear, 1075), StatusOk);
    EXPECT_EQ(u[0], 0);  // NaN to 0 for unsigned
    ASSERT_EQ(z.zorsConvert_32f8u_Sfs(src, u, 20, RoundNear, 1074), StatusOk);
    EXPECT_EQ(u[0], 255);
}

// Every SIMD variant against the generic entry on random data, odd lengths
// and unaligned pointers.
TEST_P(VecConvert, AgreesWithGeneric) {
    const zt::Api& z = this->z();
    const zt::Api& g = zt::api(0);
    std::mt19937 rng(99);
    std::uniform_real_distribution<double> u(-1.0, 1.0);
    for (int round = 0; round < 40; ++round) {
        const int n = 1 + int(rng() % 200), off = int(rng() % 4);
        const int sf = round % 5 == 0 ? 0 : int(rng() % 41) - 20;
        const int mode = int(rng() % 3);
        const double range = std::ldexp(1.0, int(rng() % 40) - 4);
        std::vector<float> f(n + 4);
        std::vector<double> d(n + 4);
        for (int i = 0; i < n + 4; ++i) {
            d[i] = u(rng) * range;
            if (rng() % 16 == 0) d[i] = std::floor(d[i] * 4) / 4;
            if (rng() % 64 == 0) d[i] = std::numeric_limits<double>::quiet_NaN();
            f[i] = float(d[i]);
        }
        std::vector<uint8_t> a(8 * (n + 4)), b(8 * (n + 4));
#define ZT_CMP(call, S, D, srcv)                                                              \
        {                                                                                      \
            std::fill(a.begin(), a.end(), 1);                                                  \
            std::fill(b.begin(), b.end(), 1);                                                  \
            ASSERT_EQ(z.call((const S*)(srcv.data() + off), (D*)(a.data() + off * sizeof(D)), n, mode, sf), StatusOk); \
            ASSERT_EQ(g.call((const S*)(srcv.data() + off), (D*)(b.data() + off * sizeof(D)), n, mode, sf), StatusOk); \
            ASSERT_EQ(a, b) << #call << " n " << n << " sf " << sf << " mode " << mode;        \
        }
        ZT_CMP(zorsConvert_32f8u_Sfs, float, uint8_t, f);
        ZT_CMP(zorsConvert_32f8s_Sfs, float, int8_t, f);
        ZT_CMP(zorsConvert_32f16u_Sfs, float, uint16_t, f);
        ZT_CMP(zorsConvert_32f16s_Sfs, float, int16_t, f);
        ZT_CMP(zorsConvert_32f32s_Sfs, float, int32_t, f);
        ZT_CMP(zorsConvert_64f32s_Sfs, double, int32_t, d);
#undef ZT_CMP
        std::vector<int32_t> iv(n + 4);
        for (auto& x : iv) x = int32_t(rng());
        std::fill(a.begin(), a.end(), 1);
        std::fill(b.begin(), b.end(), 1);
        ASSERT_EQ(z.zorsConvert_32s32f(iv.data() + off, (float*)a.data(), n), StatusOk);
        ASSERT_EQ(g.zorsConvert_32s32f(iv.data() + off, (float*)b.data(), n), StatusOk);
        ASSERT_EQ(a, b);
    }
}

ZT_ALL_VARIANTS(VecInit);
ZT_ALL_VARIANTS(VecConvert);
