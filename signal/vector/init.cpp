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

#include <algorithm>
#include <cstring>
#include <limits>
#include <type_traits>

#include "signal/vector/vector_common.h"

namespace zor { namespace ZOR_NS {
namespace {

// ---- zero and copy: byte operations, generic entry only ----------------------

#if ZOR_VARIANT == 0
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
    // 16 bytes of repeated elements: sizeof(T) divides 16, so storing the
    // pattern at any multiple of 16 bytes keeps the elements in phase.
    alignas(16) uint8_t pattern[16];
    for (size_t k = 0; k < 16; k += sizeof(T)) std::memcpy(pattern + k, &val, sizeof(T));
    const __m128 p = _mm_load_ps(reinterpret_cast<const float*>(pattern));
    for (; i + 64 <= bytes; i += 64) {
        _mm_storeu_ps(reinterpret_cast<float*>(d + i), p);
        _mm_storeu_ps(reinterpret_cast<float*>(d + i + 16), p);
        _mm_storeu_ps(reinterpret_cast<float*>(d + i + 32), p);
        _mm_storeu_ps(reinterpret_cast<float*>(d + i + 48), p);
    }
    for (; i + 16 <= bytes; i += 16) _mm_storeu_ps(reinterpret_cast<float*>(d + i), p);
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

#if ZOR_VARIANT != 1
// The per-element rule of the widening and 32s16s conversions.
template <class S, class D>
inline D widenOne(S v) {
    if constexpr (std::is_integral_v<D> && sizeof(D) < sizeof(S)) return saturate<D>(v);
    else return static_cast<D>(v);  // exact, or (32s to 32f) rounded once, ties to even
}

#  if ZOR_VARIANT == 0
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
// Sign or zero extension of the low and high halves of a register.
inline __m128i extendLo8(__m128i v, std::true_type) { return _mm_srai_epi16(_mm_unpacklo_epi8(v, v), 8); }
inline __m128i extendHi8(__m128i v, std::true_type) { return _mm_srai_epi16(_mm_unpackhi_epi8(v, v), 8); }
inline __m128i extendLo8(__m128i v, std::false_type) { return _mm_unpacklo_epi8(v, _mm_setzero_si128()); }
inline __m128i extendHi8(__m128i v, std::false_type) { return _mm_unpackhi_epi8(v, _mm_setzero_si128()); }
inline __m128i extendLo16(__m128i v, std::true_type) { return _mm_srai_epi32(_mm_unpacklo_epi16(v, v), 16); }
inline __m128i extendHi16(__m128i v, std::true_type) { return _mm_srai_epi32(_mm_unpackhi_epi16(v, v), 16); }
inline __m128i extendLo16(__m128i v, std::false_type) { return _mm_unpacklo_epi16(v, _mm_setzero_si128()); }
inline __m128i extendHi16(__m128i v, std::false_type) { return _mm_unpackhi_epi16(v, _mm_setzero_si128()); }

inline __m128i loadu(const void* p) { return _mm_loadu_si128(static_cast<const __m128i*>(p)); }
inline void storeu(void* p, __m128i v) { _mm_storeu_si128(static_cast<__m128i*>(p), v); }

// One SIMD step of each widening conversion; returns the elements done.
template <class S, class D>
inline int widenBlock(const S* s, D* d) {
    using Signed = std::integral_constant<bool, std::is_signed_v<S>>;
    if constexpr (sizeof(S) == 1) {  // 8u/8s to 16s or 32f: 16 elements
        const __m128i v = loadu(s);
        const __m128i lo = extendLo8(v, Signed()), hi = extendHi8(v, Signed());
        if constexpr (sizeof(D) == 2) {
            storeu(d, lo);
            storeu(d + 8, hi);
        } else {
            const __m128i sign = _mm_srai_epi16(lo, 15), signH = _mm_srai_epi16(hi, 15);
            _mm_storeu_ps(d, _mm_cvtepi32_ps(_mm_unpacklo_epi16(lo, sign)));
            _mm_storeu_ps(d + 4, _mm_cvtepi32_ps(_mm_unpackhi_epi16(lo, sign)));
            _mm_storeu_ps(d + 8, _mm_cvtepi32_ps(_mm_unpacklo_epi16(hi, signH)));
            _mm_storeu_ps(d + 12, _mm_cvtepi32_ps(_mm_unpackhi_epi16(hi, signH)));
        }
        return 16;
    } else if constexpr (sizeof(S) == 2 && std::is_same_v<D, float>) {
        // 16s/16u to 32f, 16 elements: the 16 bits (made unsigned) become
        // the low mantissa of 2^23, and subtracting 2^23 (plus the bias)
        // leaves the value exactly; fewer steps than extend-and-convert.
        const __m128i flip = _mm_set1_epi16(std::is_signed_v<S> ? -32768 : 0);
        const __m128i high = _mm_set1_epi16(0x4B00);
        const __m128 base = _mm_set1_ps(std::is_signed_v<S> ? 8388608.0f + 32768.0f : 8388608.0f);
        const __m128i v0 = _mm_xor_si128(loadu(s), flip), v1 = _mm_xor_si128(loadu(s + 8), flip);
        _mm_storeu_ps(d, _mm_sub_ps(_mm_castsi128_ps(_mm_unpacklo_epi16(v0, high)), base));
        _mm_storeu_ps(d + 4, _mm_sub_ps(_mm_castsi128_ps(_mm_unpackhi_epi16(v0, high)), base));
        _mm_storeu_ps(d + 8, _mm_sub_ps(_mm_castsi128_ps(_mm_unpacklo_epi16(v1, high)), base));
        _mm_storeu_ps(d + 12, _mm_sub_ps(_mm_castsi128_ps(_mm_unpackhi_epi16(v1, high)), base));
        return 16;
    } else if constexpr (sizeof(S) == 2) {  // 16s/16u to 32s: 16 elements
        const __m128i v0 = loadu(s), v1 = loadu(s + 8);
        __m128i w[4] = {extendLo16(v0, Signed()), extendHi16(v0, Signed()),
                        extendLo16(v1, Signed()), extendHi16(v1, Signed())};
        for (int k = 0; k < 4; ++k) {
            if constexpr (std::is_same_v<D, float>) _mm_storeu_ps(d + 4 * k, _mm_cvtepi32_ps(w[k]));
            else storeu(d + 4 * k, w[k]);
        }
        return 16;
    } else if constexpr (std::is_same_v<D, float>) {  // 32s to 32f
        _mm_storeu_ps(d, _mm_cvtepi32_ps(loadu(s)));
        _mm_storeu_ps(d + 4, _mm_cvtepi32_ps(loadu(s + 4)));
        return 8;
    } else if constexpr (std::is_same_v<D, double>) {  // 32s to 64f
        const __m128i v = loadu(s);
        _mm_storeu_pd(d, _mm_cvtepi32_pd(v));
        _mm_storeu_pd(d + 2, _mm_cvtepi32_pd(_mm_unpackhi_epi64(v, v)));
        return 4;
    } else {  // 32s to 16s, saturating
        storeu(d, _mm_packs_epi32(loadu(s), loadu(s + 4)));
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
// Packs four registers of 32-bit integers, already inside D's range or
// saturating as D demands, into D elements at d.
template <class D>
inline void packStore(D* d, __m128i a, __m128i b, __m128i c, __m128i e) {
    if constexpr (sizeof(D) == 4) {
        storeu(d, a);
        storeu(d + 4, b);
        storeu(d + 8, c);
        storeu(d + 12, e);
    } else if constexpr (std::is_same_v<D, int16_t>) {
        storeu(d, _mm_packs_epi32(a, b));
        storeu(d + 8, _mm_packs_epi32(c, e));
    } else if constexpr (std::is_same_v<D, uint16_t>) {
        // No unsigned 32-to-16 pack before SSE4.1: bias into the signed range.
        const __m128i bias = _mm_set1_epi32(32768), back = _mm_set1_epi16(-32768);
        storeu(d, _mm_xor_si128(_mm_packs_epi32(_mm_sub_epi32(a, bias), _mm_sub_epi32(b, bias)), back));
        storeu(d + 8, _mm_xor_si128(_mm_packs_epi32(_mm_sub_epi32(c, bias), _mm_sub_epi32(e, bias)), back));
    } else if constexpr (std::is_same_v<D, int8_t>) {
        storeu(d, _mm_packs_epi16(_mm_packs_epi32(a, b), _mm_packs_epi32(c, e)));
    } else {
        storeu(d, _mm_packus_epi16(_mm_packs_epi32(a, b), _mm_packs_epi32(c, e)));
    }
}

// Float sources, unscaled, 16 elements.  Ties to even come from the
// conversion itself (round to nearest, as float sources are exact).
//
// Unclamped, cvtps2dq (or cvttps2dq) is right for every input it can
// represent, and the packs saturate to D's range; negative values reach 0
// for 8u through the unsigned pack and for 16u through the biased one.  The
// inputs it cannot represent (NaN, values outside the int32 range) raise
// the invalid flag, and their elements are converted again clamped.
//
// The clamps: min(hi, x) keeps a NaN (the second operand wins), which the
// conversion turns into INT_MIN and the signed packs into the lowest value;
// max(x, 0) turns a NaN into 0 for unsigned destinations.  For 32s the
// conversion's INT_MIN at and above 2^31 is flipped to INT_MAX.
template <class D, bool Nearest, bool Clamp>
inline void narrowFloatBlock(const float* s, D* d) {
    using L = std::numeric_limits<D>;
    __m128i r[4];
    for (int k = 0; k < 4; ++k) {
        __m128 x = _mm_loadu_ps(s + 4 * k);
        __m128 over = _mm_setzero_ps();
        if constexpr (Clamp && sizeof(D) == 4) {
            over = _mm_cmpge_ps(x, _mm_set1_ps(2147483648.0f));
        } else if constexpr (Clamp) {
            if constexpr (!std::is_signed_v<D>) x = _mm_max_ps(x, _mm_setzero_ps());
            x = _mm_min_ps(_mm_set1_ps(float(L::max())), x);
        }
        r[k] = Nearest ? _mm_cvtps_epi32(x) : _mm_cvttps_epi32(x);
        if constexpr (Clamp && sizeof(D) == 4) r[k] = _mm_xor_si128(r[k], _mm_castps_si128(over));
    }
    packStore(d, r[0], r[1], r[2], r[3]);
}

template <class D, bool Nearest, bool Clamp>
[[gnu::noinline]] void narrowFloatRun(const float* s, D* d, int n) {
    for (int i = 0; i + 16 <= n; i += 16) narrowFloatBlock<D, Nearest, Clamp>(s + i, d + i);
}

// The first n elements (a multiple of 16), in runs of 1024: each run fast,
// and again clamped if it met an input the fast form cannot take.  With the
// invalid exception unmasked, where a SIMD conversion of such an input would
// trap, nothing is done here and the caller's element loop does it all.
template <class D, bool Nearest>
int narrowFloats(const float* s, D* d, int n) {
    ConversionScope csr;
    if (!csr.armed()) return 0;
    for (int i = 0; i < n; i += 1024) {
        const int m = std::min(1024, n - i);
        csr.run([&](bool clamp) {
            if (clamp) narrowFloatRun<D, Nearest, true>(s + i, d + i, m);
            else narrowFloatRun<D, Nearest, false>(s + i, d + i, m);
        });
    }
    return n;
}

// Two doubles to two 32-bit integers (low half) by convertOne's rule.  x is
// already clamped from above (a NaN kept).  Round-to-zero is the truncating
// conversion; round-to-nearest replays the half-away-and-back-if-odd steps,
// which for double sources differs from plain ties-to-even at 0.5 + 2^-53.
inline __m128i narrowPairDouble(__m128d x, bool nearest) {
    if (!nearest) return _mm_cvttpd_epi32(x);
    const __m128d signBit = _mm_set1_pd(-0.0);
    const __m128d half = _mm_or_pd(_mm_and_pd(x, signBit), _mm_set1_pd(0.5));
    const __m128d sum = _mm_add_pd(x, half);
    __m128i t = _mm_cvttpd_epi32(sum);
    const __m128i tie = _mm_shuffle_epi32(_mm_castpd_si128(_mm_cmpeq_pd(_mm_cvtepi32_pd(t), sum)),
                                          _MM_SHUFFLE(3, 3, 2, 0));
    const __m128i neg = _mm_shuffle_epi32(_mm_castpd_si128(_mm_cmplt_pd(x, _mm_setzero_pd())),
                                          _MM_SHUFFLE(3, 3, 2, 0));
    const __m128i step = _mm_and_si128(_mm_and_si128(tie, t), _mm_set1_epi32(1));
    // toward zero: -1 for non-negative x, +1 for negative x
    return _mm_sub_epi32(t, _mm_sub_epi32(_mm_xor_si128(step, neg), neg));
}

// Double values (scaled float sources or double sources) to 32-bit
// integers clamped into D's range, NaN kept where D is signed.
template <class D>
inline __m128i narrowDoubles(__m128d x0, __m128d x1, bool nearest) {
    using L = std::numeric_limits<D>;
    if constexpr (!std::is_signed_v<D>) {
        x0 = _mm_max_pd(x0, _mm_setzero_pd());
        x1 = _mm_max_pd(x1, _mm_setzero_pd());
    }
    const __m128d hi = _mm_set1_pd(double(L::max()));
    x0 = _mm_min_pd(hi, x0);
    x1 = _mm_min_pd(hi, x1);
    return _mm_unpacklo_epi64(narrowPairDouble(x0, nearest), narrowPairDouble(x1, nearest));
}

template <class S, class D>
inline void narrowScaledBlock(const S* s, D* d, __m128d mult, bool scaled, bool nearest) {
    __m128i r[4];
    for (int k = 0; k < 4; ++k) {
        __m128d x0, x1;
        if constexpr (std::is_same_v<S, float>) {
            const __m128 v = _mm_loadu_ps(s + 4 * k);
            x0 = _mm_cvtps_pd(v);
            x1 = _mm_cvtps_pd(_mm_movehl_ps(v, v));
        } else {
            x0 = _mm_loadu_pd(s + 4 * k);
            x1 = _mm_loadu_pd(s + 4 * k + 2);
        }
        if (scaled) {
            x0 = _mm_mul_pd(x0, mult);
            x1 = _mm_mul_pd(x1, mult);
        }
        r[k] = narrowDoubles<D>(x0, x1, nearest);
    }
    packStore(d, r[0], r[1], r[2], r[3]);
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
        const __m128d mult = _mm_set1_pd(one.mult);
        for (; i + 16 <= len; i += 16)
            narrowScaledBlock(pSrc + i, pDst + i, mult, one.scaled, one.nearest);
    }
#  endif
    for (; i < len; ++i) pDst[i] = one(pSrc[i]);
    return StatusOk;
}
#endif  // ZOR_VARIANT != 1

}  // namespace

// ---- exports --------------------------------------------------------------------

#if ZOR_VARIANT == 0
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

#if ZOR_VARIANT != 1
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
