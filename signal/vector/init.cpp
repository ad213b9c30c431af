// Signal vectors: zero, set, copy and element type conversion.
//
// Zero and copy are byte operations served by the C library (one entry for
// every processor).  Set stores the caller's bit pattern unchanged, also for
// float values (a signalling NaN stays signalling), so it never moves
// elements through the FPU.  The conversions widen exactly, or narrow with
// saturation; float to integer narrowing follows one per-element rule
// (convertOne) that every SIMD path reproduces bit for bit.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/mxcsr.h"
#include "frame/simd.h"

#include <algorithm>
#include <cstring>
#include <limits>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

// ---- zero and copy: byte operations, generic entry only ----------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
template <class T>
Status zeroVector(T* pDst, int len) {
    if (Status s = checkFirst(anyNull(pDst), badLength(len))) return s;
    std::memset(static_cast<void*>(pDst), 0, static_cast<size_t>(len) * sizeof(T));
    return StatusOk;
}

// memmove: a copy between overlapping vectors gives what a copy through a
// temporary would.
template <class T>
Status copyVector(const T* pSrc, T* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    std::memmove(static_cast<void*>(pDst), static_cast<const void*>(pSrc),
                 static_cast<size_t>(len) * sizeof(T));
    return StatusOk;
}
#endif

// ---- set ---------------------------------------------------------------------

// Fills len elements with the bytes of val.  The elements are handled as raw
// bytes: loading a float into the x87 unit would quiet a signalling NaN.
template <class T>
void fillPattern(T* pDst, const T& val, int len) {
    uint8_t* d = reinterpret_cast<uint8_t*>(pDst);
    const size_t bytes = static_cast<size_t>(len) * sizeof(T);
    size_t i = 0;
#if ZOR_SIMD >= 1
    // A register of repeated elements (float lanes only carry the bytes):
    // sizeof(T) divides its width, so storing it at any multiple of the
    // width keeps the elements in phase.
    using V = simd::Vec<float>;
    constexpr size_t kWidth = V::kBytes;
    alignas(64) uint8_t pattern[kWidth];
    for (size_t k = 0; k < kWidth; k += sizeof(T)) std::memcpy(pattern + k, &val, sizeof(T));
    const V p = simd::loadFrom<V>(pattern);
    for (; i + 4 * kWidth <= bytes; i += 4 * kWidth)
        for (size_t k = 0; k < 4; ++k) simd::storeTo(d + i + k * kWidth, p);
    for (; i + kWidth <= bytes; i += kWidth) simd::storeTo(d + i, p);
#endif
    for (; i < bytes; i += sizeof(T)) std::memcpy(d + i, &val, sizeof(T));
}

template <class T>
Status setVector(const T& val, T* pDst, int len) {
    if (Status s = checkFirst(anyNull(pDst), badLength(len))) return s;
    fillPattern(pDst, val, len);
    return StatusOk;
}

// ---- integer and float widening -----------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
// The per-element rule of the widening and 32s16s conversions.
template <class S, class D>
inline D widenOne(S v) {
    if constexpr (std::is_integral_v<D> && sizeof(D) < sizeof(S)) return saturate<D>(v);
    else return static_cast<D>(v);  // exact, or (32s to 32f) rounded once, ties to even
}

#  if ZOR_SIMD < 2
// The float values -128 .. 255: 8-bit sources are converted by lookup.
struct ByteFloatTable {
    float v[384];
    constexpr ByteFloatTable() : v() {
        for (int i = 0; i < 384; ++i) v[i] = static_cast<float>(i - 128);
    }
};
constexpr ByteFloatTable kByteFloat;
#  endif

#  if ZOR_SIMD >= 2
// One step of each widening conversion from a 16-byte register of sources
// (the widened halves are stored in order); returns the elements done.
template <class S, class D>
inline int widenBlock(const S* s, D* d) {
    using namespace simd;
    using V = Vec<S, 16>;
    if constexpr (sizeof(S) == 1) {  // 8u/8s to 16s or 32f: 16 elements
        const V v = load<V>(s);
        const auto lo = bitcast<int16_t>(widenLo(v)), hi = bitcast<int16_t>(widenHi(v));
        if constexpr (sizeof(D) == 2) {
            store(d, lo);
            store(d + 8, hi);
        } else {
            store(d, toFloat(widenLo(lo)));
            store(d + 4, toFloat(widenHi(lo)));
            store(d + 8, toFloat(widenLo(hi)));
            store(d + 12, toFloat(widenHi(hi)));
        }
        return 16;
    } else if constexpr (sizeof(S) == 2 && std::is_same_v<D, float>) {
        // 16s/16u to 32f, 16 elements: the 16 bits (made unsigned) become
        // the low mantissa of 2^23, and subtracting 2^23 (plus the bias)
        // leaves the value exactly; fewer steps than extend-and-convert.
        using W = Vec<uint16_t, 16>;
        using F = Vec<float, 16>;
        const W flip = set1<W>(std::is_signed_v<S> ? 0x8000 : 0), high = set1<W>(0x4B00);
        const F base = set1<F>(std::is_signed_v<S> ? 8388608.0f + 32768.0f : 8388608.0f);
        const W v0 = bitcast<uint16_t>(load<V>(s)) ^ flip, v1 = bitcast<uint16_t>(load<V>(s + 8)) ^ flip;
        store(d, bitcast<float>(zipLo(v0, high)) - base);
        store(d + 4, bitcast<float>(zipHi(v0, high)) - base);
        store(d + 8, bitcast<float>(zipLo(v1, high)) - base);
        store(d + 12, bitcast<float>(zipHi(v1, high)) - base);
        return 16;
    } else if constexpr (sizeof(S) == 2) {  // 16s/16u to 32s: 16 elements
        const V v0 = load<V>(s), v1 = load<V>(s + 8);
        store(d, bitcast<D>(widenLo(v0)));
        store(d + 4, bitcast<D>(widenHi(v0)));
        store(d + 8, bitcast<D>(widenLo(v1)));
        store(d + 12, bitcast<D>(widenHi(v1)));
        return 16;
    } else if constexpr (std::is_same_v<D, float>) {  // 32s to 32f
        store(d, toFloat(load<V>(s)));
        store(d + 4, toFloat(load<V>(s + 4)));
        return 8;
    } else if constexpr (std::is_same_v<D, double>) {  // 32s to 64f
        const V v = load<V>(s);
        store(d, toDoubleLo(v));
        store(d + 2, toDoubleHi(v));
        return 4;
    } else {  // 32s to 16s, saturating
        store(d, narrowSat<int16_t>(load<V>(s), load<V>(s + 4)));
        return 8;
    }
}
#  endif

template <class S, class D>
Status widenVector(const S* pSrc, D* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    int i = 0;
#  if ZOR_SIMD >= 2
    constexpr int step = (sizeof(S) <= 2) ? 16 : (std::is_same_v<D, double> ? 4 : 8);
    for (; i + step <= len; i += step) widenBlock(pSrc + i, pDst + i);
    for (; i < len; ++i) pDst[i] = widenOne<S, D>(pSrc[i]);
#  else
    if constexpr (sizeof(S) == 1 && std::is_same_v<D, float>) {
        for (; i < len; ++i) pDst[i] = kByteFloat.v[128 + pSrc[i]];
    } else {
        for (; i < len; ++i) pDst[i] = widenOne<S, D>(pSrc[i]);
    }
#  endif
    return StatusOk;
}

// ---- float to integer ------------------------------------------------------------

// The per-element rule.  x is the scaled source; cmpLo and cmpHi the bounds
// the comparisons use (see Narrowing).
template <class D>
inline D convertOne(double x, bool nearest, double cmpLo, double cmpHi) {
    using L = std::numeric_limits<D>;
    if (x >= cmpHi) return L::max();
    if constexpr (std::is_signed_v<D>) {
        if (!(x > cmpLo)) return L::min();  // NaN lands here: the lowest value, deliberately
    } else {
        if (!(x > 0)) return 0;  // NaN too
    }
    int64_t t;
    if (nearest) {
        // Half away from zero, then back one step where the sum was an exact
        // tie that landed on an odd integer: ties go to even.
        const double sum = x >= 0 ? x + 0.5 : x - 0.5;
        t = static_cast<int64_t>(sum);
        if ((t & 1) && static_cast<double>(t) == sum) t += x >= 0 ? -1 : 1;
    } else {
        t = static_cast<int64_t>(x);
    }
    return static_cast<D>(t);
}

// 2^-scaleFactor, as halving 1.0 scaleFactor times (or doubling it
// -scaleFactor times) gives it: exact, subnormal down to 2^-1074, 0 beyond
// that (the last halving is a tie that rounds to even), infinite beyond
// 2^1023.  Built from the bits, so a huge factor costs no loop and no x87
// register can keep an exponent that a double cannot hold.
inline double scaleMultiplier(int scaleFactor) {
    const int64_t e = -static_cast<int64_t>(scaleFactor);
    uint64_t bits;
    if (e > 1023) bits = uint64_t(0x7ff) << 52;                      // +infinity
    else if (e >= -1022) bits = uint64_t(e + 1023) << 52;            // normal
    else if (e >= -1074) bits = uint64_t(1) << (e + 1074);           // subnormal
    else bits = 0;
    double d;
    std::memcpy(&d, &bits, sizeof d);
    return d;
}


template <class S, class D>
struct Narrowing {
    double mult;         // 2^-scaleFactor, unused when scaled is false
    bool scaled;
    bool nearest;
    double cmpLo, cmpHi;

    Narrowing(int rndMode, int scaleFactor)
        : mult(scaleMultiplier(scaleFactor)), scaled(scaleFactor != 0), nearest(rndMode == RoundNear) {
        using L = std::numeric_limits<D>;
        // Unscaled sources are compared with the bounds as the source type
        // holds them: a float cannot hold 2147483647, its nearest is 2^31,
        // so every float below 2^31 converts in range.
        cmpLo = scaled ? double(L::min()) : double(static_cast<S>(L::min()));
        cmpHi = scaled ? double(L::max()) : double(static_cast<S>(L::max()));
    }
    D operator()(S v) const {
        double x = v;
        if (scaled) x = toDouble(x * mult);
        return convertOne<D>(x, nearest, cmpLo, cmpHi);
    }
};

#  if ZOR_SIMD >= 2
// The blocks below hold 16 elements as four 16-byte registers of 32-bit
// integers, packed in order.
using F4 = simd::Vec<float, 16>;
using I4 = simd::Vec<int32_t, 16>;
using D2 = simd::Vec<double, 16>;

// Stores four registers of 32-bit integers as D elements at d, saturating
// to D's range.
template <class D>
inline void packStore(D* d, const I4 (&r)[4]) {
    using namespace simd;
    if constexpr (sizeof(D) == 4) {
        for (int k = 0; k < 4; ++k) store(d + 4 * k, r[k]);
    } else if constexpr (sizeof(D) == 2) {
        store(d, narrowSat<D>(r[0], r[1]));
        store(d + 8, narrowSat<D>(r[2], r[3]));
    } else {
        store(d, narrowSat<D>(narrowSat<int16_t>(r[0], r[1]), narrowSat<int16_t>(r[2], r[3])));
    }
}

// Float sources, unscaled, 16 elements.  Ties to even come from the
// conversion itself (round to nearest, as float sources are exact).
//
// cvtps2dq (or cvttps2dq) is right for every input it can represent, and
// the packs saturate to D's range; the clamps before it take care of the
// rest (NaN, values outside the int32 range): min(hi, x) keeps a NaN (the second operand wins), which the
// conversion turns into INT_MIN and the signed packs into the lowest value;
// max(x, 0) turns a NaN into 0 for unsigned destinations.  For 32s the
// conversion's INT_MIN at and above 2^31 is flipped to INT_MAX.
template <class D, bool Nearest>
inline void narrowFloatBlock(const float* s, D* d) {
    using namespace simd;
    using L = std::numeric_limits<D>;
    I4 r[4];
    for (int k = 0; k < 4; ++k) {
        F4 x = load<F4>(s + 4 * k);
        I4 over = zero<I4>();
        if constexpr (sizeof(D) == 4) {
            over = bitcast<int32_t>(ge(x, set1<F4>(2147483648.0f)));
        } else {
            if constexpr (!std::is_signed_v<D>) x = max(x, zero<F4>());
            x = min(set1<F4>(float(L::max())), x);
        }
        r[k] = Nearest ? toInt32(x) : toInt32Trunc(x);
        if constexpr (sizeof(D) == 4) r[k] = r[k] ^ over;
    }
    packStore(d, r);
}

template <class D, bool Nearest>
void narrowFloatRun(const float* s, D* d, int n) {
    for (int i = 0; i + 16 <= n; i += 16) narrowFloatBlock<D, Nearest>(s + i, d + i);
}

// The first n elements (a multiple of 16), clamped on the way: the clamps
// cost a compare or two per register, far less than the memory traffic, and
// give every input its value without consulting the processor's status
// flags (which tools such as valgrind do not model).  With the invalid
// exception unmasked, where a SIMD conversion of a NaN would trap, nothing
// is done here and the caller's element loop does it all.
template <class D, bool Nearest>
int narrowFloats(const float* s, D* d, int n) {
    ConversionScope nearestEven;
    if (!nearestEven.armed()) return 0;
    narrowFloatRun<D, Nearest>(s, d, n);
    return n;
}

// Four doubles to 32-bit integers by convertOne's rule.  x0, x1 are
// already clamped from above (a NaN kept).  Round-to-zero is the truncating
// conversion; round-to-nearest replays the half-away-and-back-if-odd steps,
// which for double sources differs from plain ties-to-even at 0.5 + 2^-53.
inline I4 narrowPairsOfDoubles(D2 x0, D2 x1, bool nearest) {
    using namespace simd;
    if (!nearest) return toInt32Trunc(x0, x1);
    const D2 signBit = set1<D2>(-0.0), half = set1<D2>(0.5), z = zero<D2>();
    const D2 sum0 = x0 + ((x0 & signBit) | half), sum1 = x1 + ((x1 & signBit) | half);
    const I4 t = toInt32Trunc(sum0, sum1);
    // the double masks as 32-bit lanes, one per element
    const auto perElement = [](D2 m0, D2 m1) { return concatEven(bitcast<int32_t>(m0), bitcast<int32_t>(m1)); };
    const I4 tie = perElement(eq(toDoubleLo(t), sum0), eq(toDoubleHi(t), sum1));
    const I4 neg = perElement(lt(x0, z), lt(x1, z));
    const I4 step = tie & t & set1<I4>(1);
    // toward zero: -1 for non-negative x, +1 for negative x
    return t - ((step ^ neg) - neg);
}

// Double values (scaled float sources or double sources) to 32-bit
// integers clamped into D's range, NaN kept where D is signed.
template <class D>
inline I4 narrowDoubles(D2 x0, D2 x1, bool nearest) {
    using namespace simd;
    using L = std::numeric_limits<D>;
    if constexpr (!std::is_signed_v<D>) {
        x0 = max(x0, zero<D2>());
        x1 = max(x1, zero<D2>());
    }
    const D2 hi = set1<D2>(double(L::max()));
    return narrowPairsOfDoubles(min(hi, x0), min(hi, x1), nearest);
}

template <class S, class D>
inline void narrowScaledBlock(const S* s, D* d, D2 mult, bool scaled, bool nearest) {
    using namespace simd;
    I4 r[4];
    for (int k = 0; k < 4; ++k) {
        D2 x0, x1;
        if constexpr (std::is_same_v<S, float>) {
            const F4 v = load<F4>(s + 4 * k);
            x0 = widenLo(v);
            x1 = widenHi(v);
        } else {
            x0 = load<D2>(s + 4 * k);
            x1 = load<D2>(s + 4 * k + 2);
        }
        if (scaled) {
            x0 = x0 * mult;
            x1 = x1 * mult;
        }
        r[k] = narrowDoubles<D>(x0, x1, nearest);
    }
    packStore(d, r);
}
#  endif

template <class S, class D>
Status narrowVector(const S* pSrc, D* pDst, int len, int rndMode, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    DoublePrecisionScope fpu;
    const Narrowing<S, D> one(rndMode, scaleFactor);
    int i = 0;
#  if ZOR_SIMD >= 2
    bool done = false;
    if constexpr (std::is_same_v<S, float>) {
        if (!one.scaled) {
            i = one.nearest ? narrowFloats<D, true>(pSrc, pDst, len & ~15)
                            : narrowFloats<D, false>(pSrc, pDst, len & ~15);
            done = true;
        }
    }
    if (!done) {
        const D2 mult = simd::set1<D2>(one.mult);
        for (; i + 16 <= len; i += 16)
            narrowScaledBlock(pSrc + i, pDst + i, mult, one.scaled, one.nearest);
    }
#  endif
    for (; i < len; ++i) pDst[i] = one(pSrc[i]);
    return StatusOk;
}
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

}  // namespace

// ---- exports --------------------------------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zorsZero_8u(uint8_t* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_16s(int16_t* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_16sc(Complex16s* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_32f(float* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_32fc(Complex32f* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_64f(double* pDst, int len) { return zeroVector(pDst, len); }
Status ZOR_CALL zorsZero_64fc(Complex64f* pDst, int len) { return zeroVector(pDst, len); }

Status ZOR_CALL zorsCopy_8u(const uint8_t* pSrc, uint8_t* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_16s(const int16_t* pSrc, int16_t* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_16sc(const Complex16s* pSrc, Complex16s* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_32f(const float* pSrc, float* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_32fc(const Complex32f* pSrc, Complex32f* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_64f(const double* pSrc, double* pDst, int len) { return copyVector(pSrc, pDst, len); }
Status ZOR_CALL zorsCopy_64fc(const Complex64f* pSrc, Complex64f* pDst, int len) { return copyVector(pSrc, pDst, len); }
#endif

Status ZOR_CALL zorsSet_8u(uint8_t val, uint8_t* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_16s(int16_t val, int16_t* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_32s(int32_t val, int32_t* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_64s(int64_t val, int64_t* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_32f(float val, float* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_64f(double val, double* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_16sc(Complex16s val, Complex16s* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_32sc(Complex32s val, Complex32s* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_32fc(Complex32f val, Complex32f* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_64sc(Complex64s val, Complex64s* pDst, int len) { return setVector(val, pDst, len); }
Status ZOR_CALL zorsSet_64fc(Complex64f val, Complex64f* pDst, int len) { return setVector(val, pDst, len); }

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zorsConvert_8s16s(const int8_t* pSrc, int16_t* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_16s32s(const int16_t* pSrc, int32_t* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_8u32f(const uint8_t* pSrc, float* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_8s32f(const int8_t* pSrc, float* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_16s32f(const int16_t* pSrc, float* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_16u32f(const uint16_t* pSrc, float* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_32s32f(const int32_t* pSrc, float* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_32s64f(const int32_t* pSrc, double* pDst, int len) { return widenVector(pSrc, pDst, len); }
Status ZOR_CALL zorsConvert_32s16s(const int32_t* pSrc, int16_t* pDst, int len) { return widenVector(pSrc, pDst, len); }

Status ZOR_CALL zorsConvert_32f8u_Sfs(const float* pSrc, uint8_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
Status ZOR_CALL zorsConvert_32f8s_Sfs(const float* pSrc, int8_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
Status ZOR_CALL zorsConvert_32f16u_Sfs(const float* pSrc, uint16_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
Status ZOR_CALL zorsConvert_32f16s_Sfs(const float* pSrc, int16_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
Status ZOR_CALL zorsConvert_32f32s_Sfs(const float* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
Status ZOR_CALL zorsConvert_64f32s_Sfs(const double* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor) {
    return narrowVector(pSrc, pDst, len, rndMode, scaleFactor);
}
#endif

}}  // namespace zor::ZOR_NS
