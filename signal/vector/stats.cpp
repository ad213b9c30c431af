// Vector statistics: sums, mean, standard deviation, extrema, norms, dot
// products.
//
// The float reductions accumulate in double in a fixed order that the SIMD
// paths reproduce lane for lane, so every variant returns the same bits:
//   - sum, mean, standard deviation: two partial sums, one over the even and
//     one over the odd elements of each group of four, added together at the
//     end, then the remainder added one by one;
//   - dot product and L2 norms: eight partial sums (element i goes to sum
//     i mod 8) over groups of eight, combined as
//     ((s0 + s2) + (s4 + s6)) + ((s1 + s3) + (s5 + s7)), then the remainder.
// The integer reductions are exact, so their order does not matter.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/status.h"

#include <cmath>
#include <cstdlib>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

// ---- accumulation in two partial sums -----------------------------------------

struct SumAndSquares {
    double sum, squares;
};

// Sum (and optionally sum of squares) in the even/odd order described above.
template <bool Squares>
SumAndSquares pairSums(const float* s, int n) {
    int i = 0;
    double t, q = 0.0;
#if ZOR_SIMD >= 2
    __m128d acc = _mm_setzero_pd(), accq = _mm_setzero_pd();
    for (; i + 4 <= n; i += 4) {
        const __m128 x = _mm_loadu_ps(s + i);
        const __m128d a = _mm_cvtps_pd(x), b = _mm_cvtps_pd(_mm_movehl_ps(x, x));
        acc = _mm_add_pd(_mm_add_pd(acc, a), b);
        if (Squares) accq = _mm_add_pd(_mm_add_pd(accq, _mm_mul_pd(a, a)), _mm_mul_pd(b, b));
    }
    t = _mm_cvtsd_f64(_mm_add_sd(acc, _mm_unpackhi_pd(acc, acc)));
    if (Squares) q = _mm_cvtsd_f64(_mm_add_sd(accq, _mm_unpackhi_pd(accq, accq)));
#else
    double s0 = 0.0, s1 = 0.0, q0 = 0.0, q1 = 0.0;
    for (; i + 4 <= n; i += 4) {
        const double a = s[i], b = s[i + 1], c = s[i + 2], d = s[i + 3];
        s0 = toDouble(toDouble(s0 + a) + c);
        s1 = toDouble(toDouble(s1 + b) + d);
        if (Squares) {
            q0 = toDouble(toDouble(q0 + a * a) + c * c);
            q1 = toDouble(toDouble(q1 + b * b) + d * d);
        }
    }
    t = toDouble(s0 + s1);
    if (Squares) q = toDouble(q0 + q1);
#endif
    for (; i < n; ++i) {
        const double x = s[i];
        t = toDouble(t + x);
        if (Squares) q = toDouble(q + x * x);
    }
    return {t, q};
}

// ---- accumulation in eight partial sums ------------------------------------------

// Term kinds: a * b, a * a, (a - b)^2, each formed in double.
enum class Term { Product, Square, DiffSquare };

template <Term K>
inline double term(float a, float b) {
    const double x = a, y = b;
    if (K == Term::Product) return x * y;
    if (K == Term::Square) return x * x;
    const double d = toDouble(x - y);
    return d * d;
}

#if ZOR_SIMD >= 2
template <Term K>
inline __m128d vterm(__m128d x, __m128d y) {
    if (K == Term::Product) return _mm_mul_pd(x, y);
    if (K == Term::Square) return _mm_mul_pd(x, x);
    const __m128d d = _mm_sub_pd(x, y);
    return _mm_mul_pd(d, d);
}
#endif

#if ZOR_SIMD >= 2
// Two floats widened to double straight from memory.
inline __m128d load2(const float* p) {
    return _mm_cvtps_pd(_mm_castsi128_ps(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p))));
}
#endif

template <Term K>
double eightSums(const float* a, const float* b, int n) {
    int i = 0;
    double t;
#if ZOR_SIMD >= 2
    __m128d c0 = _mm_setzero_pd(), c1 = c0, c2 = c0, c3 = c0;
    for (; i + 8 <= n; i += 8) {
        c0 = _mm_add_pd(c0, vterm<K>(load2(a + i), load2(b + i)));
        c1 = _mm_add_pd(c1, vterm<K>(load2(a + i + 2), load2(b + i + 2)));
        c2 = _mm_add_pd(c2, vterm<K>(load2(a + i + 4), load2(b + i + 4)));
        c3 = _mm_add_pd(c3, vterm<K>(load2(a + i + 6), load2(b + i + 6)));
    }
    const __m128d s = _mm_add_pd(_mm_add_pd(c0, c1), _mm_add_pd(c2, c3));
    t = _mm_cvtsd_f64(_mm_add_sd(s, _mm_unpackhi_pd(s, s)));
#else
    double s[8] = {0, 0, 0, 0, 0, 0, 0, 0};
    for (; i + 8 <= n; i += 8)
        for (int j = 0; j < 8; ++j) s[j] = toDouble(s[j] + term<K>(a[i + j], b[i + j]));
    const double even = toDouble(toDouble(s[0] + s[2]) + toDouble(s[4] + s[6]));
    const double odd = toDouble(toDouble(s[1] + s[3]) + toDouble(s[5] + s[7]));
    t = toDouble(even + odd);
#endif
    for (; i < n; ++i) t = toDouble(t + term<K>(a[i], b[i]));
    return t;
}

// ---- extrema --------------------------------------------------------------------
//
// A later element replaces the kept one only when strictly better, so ties
// keep the first index, and a NaN never replaces anything (a NaN in the first
// place is kept).  The SIMD paths find the extreme value M lane by lane with
// the same strict rule, then the first element equal to M: that is the
// element the sequential scan keeps (it tells -0.0 from +0.0 too).

template <class T, bool Max>
inline bool better(T x, T kept) { return Max ? x > kept : x < kept; }

template <class T, bool Max>
int extremeIndexScalar(const T* s, int n) {
    int idx = 0;
    T m = s[0];
    for (int i = 1; i < n; ++i)
        if (better<T, Max>(s[i], m)) {
            m = s[i];
            idx = i;
        }
    return idx;
}

#if ZOR_SIMD >= 1
// Lane operations per element type: broadcast, load, strict max/min step
// (x replaces m where strictly better), equality mask, horizontal fold.
struct F32Lanes {
    using T = float;
    using V = __m128;
    static constexpr int W = 4;
    static V set(T v) { return _mm_set1_ps(v); }
    static V load(const T* p) { return _mm_loadu_ps(p); }
    template <bool Max> static V step(V x, V m) { return Max ? _mm_max_ps(x, m) : _mm_min_ps(x, m); }
    static int eqMask(V a, V b) { return _mm_movemask_ps(_mm_cmpeq_ps(a, b)); }
    static void store(T* p, V v) { _mm_storeu_ps(p, v); }
};
#endif
#if ZOR_SIMD >= 2
struct F64Lanes {
    using T = double;
    using V = __m128d;
    static constexpr int W = 2;
    static V set(T v) { return _mm_set1_pd(v); }
    static V load(const T* p) { return _mm_loadu_pd(p); }
    template <bool Max> static V step(V x, V m) { return Max ? _mm_max_pd(x, m) : _mm_min_pd(x, m); }
    static int eqMask(V a, V b) { return _mm_movemask_pd(_mm_cmpeq_pd(a, b)); }
    static void store(T* p, V v) { _mm_storeu_pd(p, v); }
};
struct S16Lanes {
    using T = int16_t;
    using V = __m128i;
    static constexpr int W = 8;
    static V set(T v) { return _mm_set1_epi16(v); }
    static V load(const T* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); }
    template <bool Max> static V step(V x, V m) { return Max ? _mm_max_epi16(x, m) : _mm_min_epi16(x, m); }
    static int eqMask(V a, V b) { return _mm_movemask_epi8(_mm_cmpeq_epi16(a, b)); }
    static void store(T* p, V v) { _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v); }
};

#endif

#if ZOR_SIMD >= 1
// Index of the first set lane in an eqMask result.
template <class L>
inline int firstLane(int mask) {
    int k = __builtin_ctz(static_cast<unsigned>(mask));
    return L::W == 8 ? k / 2 : k;
}

template <class L, bool Max>
int extremeIndexSimd(const typename L::T* s, int n) {
    using T = typename L::T;
    if (!(s[0] == s[0])) return 0;  // a leading NaN is kept
    // Four independent accumulators, each updated with the strict rule.
    typename L::V m0 = L::set(s[0]), m1 = m0, m2 = m0, m3 = m0;
    int i = 0;
    for (; i + 4 * L::W <= n; i += 4 * L::W) {
        m0 = L::template step<Max>(L::load(s + i), m0);
        m1 = L::template step<Max>(L::load(s + i + L::W), m1);
        m2 = L::template step<Max>(L::load(s + i + 2 * L::W), m2);
        m3 = L::template step<Max>(L::load(s + i + 3 * L::W), m3);
    }
    T lanes[4 * L::W];
    L::store(lanes, m0);
    L::store(lanes + L::W, m1);
    L::store(lanes + 2 * L::W, m2);
    L::store(lanes + 3 * L::W, m3);
    T m = s[0];
    for (int k = 0; k < 4 * L::W; ++k)
        if (better<T, Max>(lanes[k], m)) m = lanes[k];
    for (; i < n; ++i)
        if (better<T, Max>(s[i], m)) m = s[i];
    // The first element equal to the extreme value.
    const typename L::V vm = L::set(m);
    int j = 0;
    for (; j + L::W <= n; j += L::W)
        if (int mask = L::eqMask(L::load(s + j), vm)) return j + firstLane<L>(mask);
    for (; j < n; ++j)
        if (s[j] == m) return j;
    return 0;  // not reached: m is one of the elements
}
#endif

// The index of the element kept by the sequential strict scan.
template <class T, bool Max>
int extremeIndex(const T* s, int n) {
#if ZOR_SIMD >= 2
    if constexpr (std::is_same_v<T, double>) return extremeIndexSimd<F64Lanes, Max>(s, n);
    if constexpr (std::is_same_v<T, int16_t>) return extremeIndexSimd<S16Lanes, Max>(s, n);
#endif
#if ZOR_SIMD >= 1
    if constexpr (std::is_same_v<T, float>) return extremeIndexSimd<F32Lanes, Max>(s, n);
#endif
    return extremeIndexScalar<T, Max>(s, n);
}

// The extreme value, and optionally its first index (a null pIndx is allowed:
// then only the value is reported).
template <class T, bool Max>
Status extremeOf(const T* pSrc, int len, T* pValue, int* pIndx = nullptr) {
    if (Status s = checkFirst(anyNull(pSrc, pValue), badLength(len))) return s;
    const int k = extremeIndex<T, Max>(pSrc, len);
    *pValue = pSrc[k];
    if (pIndx) *pIndx = k;
    return StatusOk;
}

// ---- exact integer sums ------------------------------------------------------------

#if ZOR_SIMD >= 2
inline __m128i load8(const int16_t* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); }
// The four int64 lanes of two accumulators, added.
inline int64_t laneTotal(__m128i a, __m128i b) {
    alignas(16) int64_t l[4];
    _mm_store_si128(reinterpret_cast<__m128i*>(l), a);
    _mm_store_si128(reinterpret_cast<__m128i*>(l + 2), b);
    return l[0] + l[1] + l[2] + l[3];
}
#endif

// Sum of products.  pmaddwd pairs lie in [-2^31 + 2^16, 2^31]; only 2^31
// (two products of -32768 by -32768) wraps, so each pair is taken minus
// 2^16, which fits in 32 bits exactly, and the 2^16 added back at the end.
[[maybe_unused]] int64_t dot16(const int16_t* a, const int16_t* b, int n) {
    int64_t total = 0;
    int i = 0;
#if ZOR_SIMD >= 2
    const __m128i bias = _mm_set1_epi32(65536);
    __m128i lo = _mm_setzero_si128(), hi = lo;
    for (; i + 8 <= n; i += 8) {
        const __m128i w = _mm_sub_epi32(_mm_madd_epi16(load8(a + i), load8(b + i)), bias);
        const __m128i sign = _mm_srai_epi32(w, 31);
        lo = _mm_add_epi64(lo, _mm_unpacklo_epi32(w, sign));
        hi = _mm_add_epi64(hi, _mm_unpackhi_epi32(w, sign));
    }
    total = laneTotal(lo, hi) + int64_t(i / 2) * 65536;
#endif
    for (; i < n; ++i) total += int32_t(a[i]) * int32_t(b[i]);
    return total;
}

// Sum of squares: pmaddwd pairs lie in [0, 2^31], exact as unsigned 32 bits.
[[maybe_unused]] int64_t sumSquares16(const int16_t* a, int n) {
    int64_t total = 0;
    int i = 0;
#if ZOR_SIMD >= 2
    const __m128i z = _mm_setzero_si128();
    __m128i lo = z, hi = z;
    for (; i + 8 <= n; i += 8) {
        const __m128i x = load8(a + i), q = _mm_madd_epi16(x, x);
        lo = _mm_add_epi64(lo, _mm_unpacklo_epi32(q, z));
        hi = _mm_add_epi64(hi, _mm_unpackhi_epi32(q, z));
    }
    total = laneTotal(lo, hi);
#endif
    for (; i < n; ++i) total += int32_t(a[i]) * int32_t(a[i]);
    return total;
}

// Sum of absolute values: |x| = (x ^ s) - s with s the sign mask, the two
// parts summed separately so that |-32768| needs no 16-bit lane.
[[maybe_unused]] int64_t sumAbs16(const int16_t* a, int n) {
    int64_t total = 0;
    int i = 0;
#if ZOR_SIMD >= 2
    const __m128i z = _mm_setzero_si128(), ones = _mm_set1_epi16(1);
    __m128i lo = z, hi = z;
    for (; i + 8 <= n; i += 8) {
        const __m128i x = load8(a + i), s = _mm_srai_epi16(x, 15);
        const __m128i t = _mm_sub_epi32(_mm_madd_epi16(_mm_xor_si128(x, s), ones), _mm_madd_epi16(s, ones));
        lo = _mm_add_epi64(lo, _mm_unpacklo_epi32(t, z));
        hi = _mm_add_epi64(hi, _mm_unpackhi_epi32(t, z));
    }
    total = laneTotal(lo, hi);
#endif
    for (; i < n; ++i) total += std::abs(int32_t(a[i]));
    return total;
}

// ---- integer scaling of the exact sums -----------------------------------------

// L1 norm: truncating right shift, saturating left shift (below -31 acts as -31).
[[maybe_unused]] int32_t scaleL1(int64_t total, int scaleFactor) {
    if (scaleFactor >= 64) return 0;
    if (scaleFactor > 0) return saturate<int32_t>(total >> scaleFactor);
    if (scaleFactor == 0) return saturate<int32_t>(total);
    const int sh = scaleFactor < -31 ? 31 : -scaleFactor;
    return total > (int64_t(0x7FFFFFFF) >> sh) ? 0x7FFFFFFF : static_cast<int32_t>(total << sh);
}

// Dot product: ties to even to the right, saturation by sign to the left,
// shifts beyond 31 act as 31.
[[maybe_unused]] int32_t scaleDot(int64_t total, int scaleFactor) {
    if (scaleFactor > 31) scaleFactor = 31;
    if (scaleFactor < -31) scaleFactor = -31;
    return saturate<int32_t>(scaleRound(total, scaleFactor));
}

}  // namespace

// ---- exports ---------------------------------------------------------------------

#if ZOR_VARIANT != 1
// The hint is accepted and has no effect.
Status ZOR_CALL zorsSum_32f(const float* pSrc, int len, float* pSum, int hint) {
    (void)hint;
    if (Status s = checkFirst(anyNull(pSrc, pSum), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pSum = toFloat(pairSums<false>(pSrc, len).sum);
    return StatusOk;
}
Status ZOR_CALL zorsMean_32f(const float* pSrc, int len, float* pMean, int hint) {
    (void)hint;
    if (Status s = checkFirst(anyNull(pSrc, pMean), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pMean = toFloat(pairSums<false>(pSrc, len).sum / len);
    return StatusOk;
}
// Sample standard deviation from S = sum x and Q = sum x^2:
// sqrt((n Q - S^2) / (n (n - 1))), 0 where n Q - S^2 is not positive.
Status ZOR_CALL zorsStdDev_32f(const float* pSrc, int len, float* pStdDev, int hint) {
    (void)hint;
    if (Status s = checkFirst(anyNull(pSrc, pStdDev), len < 2 ? StatusBadSize : StatusOk)) return s;
    DoublePrecisionScope precision;
    const SumAndSquares r = pairSums<true>(pSrc, len);
    const double n = len;
    const double d = toDouble(toDouble(n * r.squares) - toDouble(r.sum * r.sum));
    *pStdDev = d > 0 ? toFloat(std::sqrt(toDouble(d / toDouble(n * (n - 1))))) : 0.0f;
    return StatusOk;
}

Status ZOR_CALL zorsMax_16s(const int16_t* pSrc, int len, int16_t* pMax) {
    return extremeOf<int16_t, true>(pSrc, len, pMax);
}
Status ZOR_CALL zorsMax_64f(const double* pSrc, int len, double* pMax) {
    return extremeOf<double, true>(pSrc, len, pMax);
}
Status ZOR_CALL zorsMaxIndx_16s(const int16_t* pSrc, int len, int16_t* pMax, int* pIndx) {
    return extremeOf<int16_t, true>(pSrc, len, pMax, pIndx);
}
Status ZOR_CALL zorsMaxIndx_64f(const double* pSrc, int len, double* pMax, int* pIndx) {
    return extremeOf<double, true>(pSrc, len, pMax, pIndx);
}

Status ZOR_CALL zorsNorm_L2_32f(const float* pSrc, int len, float* pNorm) {
    if (Status s = checkFirst(anyNull(pSrc, pNorm), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pNorm = toFloat(std::sqrt(eightSums<Term::Square>(pSrc, pSrc, len)));
    return StatusOk;
}
Status ZOR_CALL zorsNormDiff_L2_32f(const float* pSrc1, const float* pSrc2, int len, float* pNorm) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pNorm), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pNorm = toFloat(std::sqrt(eightSums<Term::DiffSquare>(pSrc1, pSrc2, len)));
    return StatusOk;
}
Status ZOR_CALL zorsDotProd_32f(const float* pSrc1, const float* pSrc2, int len, float* pDp) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDp), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pDp = toFloat(eightSums<Term::Product>(pSrc1, pSrc2, len));
    return StatusOk;
}
#endif  // ZOR_VARIANT != 1

Status ZOR_CALL zorsMax_32f(const float* pSrc, int len, float* pMax) {
    return extremeOf<float, true>(pSrc, len, pMax);
}
Status ZOR_CALL zorsMin_32f(const float* pSrc, int len, float* pMin) {
    return extremeOf<float, false>(pSrc, len, pMin);
}
Status ZOR_CALL zorsMaxIndx_32f(const float* pSrc, int len, float* pMax, int* pIndx) {
    return extremeOf<float, true>(pSrc, len, pMax, pIndx);
}

#if ZOR_VARIANT != 1
// The integer reductions are exact sums in 64 bits: any order gives the same.
Status ZOR_CALL zorsNorm_L2_16s32f(const int16_t* pSrc, int len, float* pNorm) {
    if (Status s = checkFirst(anyNull(pSrc, pNorm), badLength(len))) return s;
    const int64_t total = sumSquares16(pSrc, len);
    DoublePrecisionScope precision;
    *pNorm = toFloat(std::sqrt(static_cast<double>(total)));
    return StatusOk;
}
// Sum of absolute values, scaled by truncation (unlike the dot product).
Status ZOR_CALL zorsNorm_L1_16s32s_Sfs(const int16_t* pSrc, int len, int32_t* pNorm, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pNorm), badLength(len))) return s;
    *pNorm = scaleL1(sumAbs16(pSrc, len), scaleFactor);
    return StatusOk;
}
Status ZOR_CALL zorsDotProd_16s32s_Sfs(const int16_t* pSrc1, const int16_t* pSrc2, int len, int32_t* pDp,
                                       int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDp), badLength(len))) return s;
    *pDp = scaleDot(dot16(pSrc1, pSrc2, len), scaleFactor);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
