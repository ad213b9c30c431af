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
// One step of each widening conversion: a register of sources at the
// column's width (widened in lane order, so any width gives the elements in
// order); returns the elements done.  32s to 64f keeps 16-byte registers,
// its int-to-double conversions work per 16-byte block.
template <class S, class D>
inline int widenBlock(const S* s, D* d) {
    using namespace simd;
    if constexpr (std::is_same_v<D, double>) {  // 32s to 64f
        using V = Vec<S, 16>;
        const V v = load<V>(s);
        store(d, toDoubleLo(v));
        store(d + 2, toDoubleHi(v));
        return 4;
    } else if constexpr (sizeof(S) == 4) {
        using V = Vec<S>;
        constexpr int L = V::kLanes;
        if constexpr (std::is_same_v<D, float>) {  // 32s to 32f
            store(d, toFloat(load<V>(s)));
            store(d + L, toFloat(load<V>(s + L)));
        } else {  // 32s to 16s, saturating
            store(d, narrowSatInOrder<int16_t>(load<V>(s), load<V>(s + L)));
        }
        return 2 * L;
    } else {
        // 8 and 16-bit sources: widened to twice their size (8u/8s to 16s),
        // or on to 32 bits and converted to float (exact)
        using V = Vec<S>;
        constexpr int L = V::kLanes;
        const V v = load<V>(s);
        const auto lo = widenLoInOrder(v), hi = widenHiInOrder(v);
        if constexpr (std::is_integral_v<D>) {
            store(d, bitcast<D>(lo));
            store(d + L / 2, bitcast<D>(hi));
        } else if constexpr (sizeof(S) == 2) {
            store(d, toFloat(bitcast<int32_t>(lo)));
            store(d + L / 2, toFloat(bitcast<int32_t>(hi)));
        } else {
            const auto widen = [&](auto h, float* out) {
                store(out, toFloat(bitcast<int32_t>(widenLoInOrder(h))));
                store(out + L / 4, toFloat(bitcast<int32_t>(widenHiInOrder(h))));
            };
            widen(lo, d);
            widen(hi, d + L / 2);
        }
        return L;
    }
}

// Elements per widenBlock step.
template <class S, class D>
constexpr int widenStep() {
    if constexpr (std::is_same_v<D, double>) return 4;
    else if constexpr (sizeof(S) == 4) return 2 * simd::Vec<S>::kLanes;
    else return simd::Vec<S>::kLanes;
}
#  endif

template <class S, class D>
Status widenVector(const S* pSrc, D* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    int i = 0;
#  if ZOR_SIMD >= 2
    // Two blocks per pass: a one-block loop (about 50 bytes) ran at 1.5 to 2
    // times the time on the development processor when it happened to sit
    // within one 64-byte line of code, which is how the 32-bit and x86-64
    // builds came to differ by 1.6 with the same instructions; the two-block
    // loop measured the same at every placement.
    constexpr int step = widenStep<S, D>();
    for (; i + 2 * step <= len; i += 2 * step) {
        widenBlock(pSrc + i, pDst + i);
        widenBlock(pSrc + i + step, pDst + i + step);
    }
    if (i + step <= len) {
        widenBlock(pSrc + i, pDst + i);
        i += step;
    }
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
using F4 = simd::Vec<float, 16>;
using I4 = simd::Vec<int32_t, 16>;
using D2 = simd::Vec<double, 16>;

// Four registers of 32-bit integers as D elements, in order, saturated to
// D's range: sizeof(D) registers of D.
template <class D, int B>
struct Packed {
    simd::Vec<D, B> v[sizeof(D)];
};

template <class D, int B>
inline Packed<D, B> pack(const simd::Vec<int32_t, B> (&r)[4]) {
    using namespace simd;
    if constexpr (sizeof(D) == 4) {
        return {{bitcast<D>(r[0]), bitcast<D>(r[1]), bitcast<D>(r[2]), bitcast<D>(r[3])}};
    } else if constexpr (sizeof(D) == 2) {
        return {{narrowSatInOrder<D>(r[0], r[1]), narrowSatInOrder<D>(r[2], r[3])}};
    } else {
        return {{narrowSatInOrder<D>(narrowSatInOrder<int16_t>(r[0], r[1]), narrowSatInOrder<int16_t>(r[2], r[3]))}};
    }
}

template <class D, int B>
inline void store(D* d, const Packed<D, B>& p) {
    for (size_t k = 0; k < sizeof(D); ++k) simd::store(d + k * simd::Vec<D, B>::kLanes, p.v[k]);
}

// Float sources, unscaled: four registers at the column's width, the
// conversions in lane order at any width.  Ties to even come from the
// conversion itself (round to nearest, as float sources are exact).
//
// cvtps2dq (or cvttps2dq) is right for every input it can represent, and
// the packs saturate to D's range; the clamps before it take care of the
// rest (NaN, values outside the int32 range): min(hi, x) keeps a NaN (the
// second operand wins), which the conversion turns into INT_MIN and the
// signed packs into the lowest value; max(x, 0) turns a NaN into 0 for
// unsigned destinations.  For 32s the conversion's INT_MIN at and above
// 2^31 is flipped to INT_MAX.
template <class D, bool Nearest>
void narrowFloatRun(const float* s, D* d, int n) {
    using namespace simd;
    using F = Vec<float>;
    using I = Vec<int32_t>;
    using L = std::numeric_limits<D>;
    for (int i = 0; i + 4 * F::kLanes <= n; i += 4 * F::kLanes) {
        I r[4];
        for (int k = 0; k < 4; ++k) {
            F x = load<F>(s + i + k * F::kLanes);
            I over = zero<I>();
            if constexpr (sizeof(D) == 4) {
                over = bitcast<int32_t>(ge(x, set1<F>(2147483648.0f)));
            } else {
                if constexpr (!std::is_signed_v<D>) x = max(x, zero<F>());
                x = min(set1<F>(float(L::max())), x);
            }
            r[k] = Nearest ? toInt32(x) : toInt32Trunc(x);
            if constexpr (sizeof(D) == 4) r[k] = r[k] ^ over;
        }
        store(d + i, pack<D>(r));
    }
}

// The elements a run of narrowFloatRun converts: whole blocks.
inline int narrowFloatBlocks(int len) {
    constexpr int kBlock = 4 * simd::Vec<float>::kLanes;
    return len - len % kBlock;
}

// The first n elements (whole blocks), clamped on the way: the clamps cost
// a compare or two per register, and give every input its value without
// consulting the processor's status flags (which tools such as valgrind do
// not model).  With the invalid exception unmasked, where
// a SIMD conversion of a NaN would trap, nothing is done here and the
// caller's element loop does it all.
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
    store(d, pack<D>(r));
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
            const int blocks = narrowFloatBlocks(len);
            i = one.nearest ? narrowFloats<D, true>(pSrc, pDst, blocks) : narrowFloats<D, false>(pSrc, pDst, blocks);
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
