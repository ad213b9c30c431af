// Vector statistics: sums, mean, standard deviation, extrema, norms, dot
// products.
//
// The float reductions accumulate in double in a fixed order that the SIMD
// paths reproduce lane for lane, so every variant returns the same bits:
//   - sum, mean, standard deviation: two partial sums, one over the even and
//     one over the odd elements of each group of four, added together at the
//     end, then the remainder added one by one;
//   - dot product and L2 norms: thirty-two partial sums (element i goes to
//     sum i mod 32) over blocks of 32, combined by halving (s[j] += s[j + 16]
//     for j < 16, then s[j] += s[j + 8] for j < 8, ... down to s0 + s1),
//     then the remainder added one by one.  32 sums are what 512-bit
//     registers need to keep their adds busy; narrower registers hold the
//     same sums in more registers (or spill some), never in another order.
// The integer reductions are exact, so their order does not matter.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/status.h"
#include "frame/simd.h"

#include <cmath>
#include <cstdlib>
#include <cstring>
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
    // the even and odd sums are the two lanes of a 16-byte register
    using namespace simd;
    using F4 = Vec<float, 16>;
    using D2 = Vec<double, 16>;
    D2 acc = zero<D2>(), accq = zero<D2>();
    for (; i + 4 <= n; i += 4) {
        const F4 x = load<F4>(s + i);
        const D2 a = widenLo(x), b = widenHi(x);
        acc = acc + a + b;
        if (Squares) accq = accq + a * a + b * b;
    }
    t = reduceAdd(acc);
    if (Squares) q = reduceAdd(accq);
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

// ---- accumulation in thirty-two partial sums ---------------------------------------

// Term kinds: a * b, a * a, (a - b)^2, each formed in double.
enum class Term { Product, Square, DiffSquare };

// On doubles or registers of doubles.
template <Term K, class T>
inline T term(T x, T y) {
    if constexpr (K == Term::Product) return x * y;
    else if constexpr (K == Term::Square) return x * x;
    else {
        T d = x - y;
        if constexpr (std::is_same_v<T, double>) d = toDouble(d);
        return d * d;
    }
}

// The sums of terms in the order described above.  D is a register of
// doubles (or a plain double in the generic code): sum i mod 32 is lane
// i mod L of register (i mod 32) / L, and halving the registers pairs the
// same sums as halving the array, the lanes of the last one by reduceAdd.
template <Term K, class D>
double thirtyTwoSums(const float* a, const float* b, int n) {
    using namespace simd;
    constexpr int L = lanesOf<D>(), kRegs = 32 / L;
    const auto at = [](const float* p) {
        if constexpr (L == 1) return double(*p);
        else return loadWidened<D>(p);
    };
    // x87 at 53 bits rounds these sums as double does: every term and sum
    // is a multiple of 2^-298 below 2^290 in magnitude, so the wider
    // exponent never shows and the sums need no trip through memory.
    D s[kRegs];
    for (D& r : s) r = zero<D>();
    int i = 0;
    for (; i + 32 <= n; i += 32)
        for (int k = 0; k < kRegs; ++k) s[k] = s[k] + term<K>(at(a + i + k * L), at(b + i + k * L));
    for (int h = kRegs / 2; h >= 1; h /= 2)
        for (int k = 0; k < h; ++k) s[k] = s[k] + s[k + h];
    double t;
    if constexpr (L == 1) t = s[0];
    else t = reduceAdd(s[0]);
    for (; i < n; ++i) t = toDouble(t + term<K>(double(a[i]), double(b[i])));
    return t;
}

// Where two NaNs meet in a sum, the one kept depends on the order of the
// add's operands, which the compiler chooses freely (and x87 keeps the one
// with the larger significand).  A NaN sum is therefore set by a rule of its
// own: the input NaN with the largest payload (the bits below the sign;
// the first such in index order) among the elements the terms read,
// quieted; with none, the default NaN (made by inf * 0 or inf - inf).
template <Term K>
double nanOfTerms(const float* a, const float* b, int n) {
    uint32_t kept = 0xFFC00000u, keptPayload = 0;
    const auto consider = [&](const float* p) {
        uint32_t u;
        std::memcpy(&u, p, 4);
        const uint32_t payload = u & 0x7FFFFFFFu;
        if (payload > 0x7F800000u && payload > keptPayload) kept = u | 0x00400000u, keptPayload = payload;
    };
    for (int i = 0; i < n; ++i) {
        consider(a + i);
        if (K != Term::Square) consider(b + i);
    }
    float f;
    std::memcpy(&f, &kept, 4);
    return f;
}

template <Term K>
double sumOfTerms(const float* a, const float* b, int n) {
#if ZOR_SIMD >= 2
    const double t = thirtyTwoSums<K, simd::Vec<double>>(a, b, n);
#else
    const double t = thirtyTwoSums<K, double>(a, b, n);
#endif
    return t == t ? t : nanOfTerms<K>(a, b, n);
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
template <class T, bool Max>
int extremeIndexSimd(const T* s, int n) {
    using namespace simd;
    using V = Vec<T>;
    constexpr int W = V::kLanes;
    if (!(s[0] == s[0])) return 0;  // a leading NaN is kept
    // Four independent accumulators, each updated with the strict rule (x
    // replaces m where strictly better: max/min keep their second operand
    // on ties and NaNs).
    const auto step = [](V x, V m) { return Max ? max(x, m) : min(x, m); };
    V m0 = set1<V>(s[0]), m1 = m0, m2 = m0, m3 = m0;
    int i = 0;
    for (; i + 4 * W <= n; i += 4 * W) {
        m0 = step(load<V>(s + i), m0);
        m1 = step(load<V>(s + i + W), m1);
        m2 = step(load<V>(s + i + 2 * W), m2);
        m3 = step(load<V>(s + i + 3 * W), m3);
    }
    alignas(64) T lanes[4 * W];
    storeAligned(lanes, m0);
    storeAligned(lanes + W, m1);
    storeAligned(lanes + 2 * W, m2);
    storeAligned(lanes + 3 * W, m3);
    T m = s[0];
    for (int k = 0; k < 4 * W; ++k)
        if (better<T, Max>(lanes[k], m)) m = lanes[k];
    for (; i < n; ++i)
        if (better<T, Max>(s[i], m)) m = s[i];
    // The first element equal to the extreme value: blocks of four
    // registers up to the one that holds it, then register by register.
    const V vm = set1<V>(m);
    const auto same = [&](int at) { return eq(load<V>(s + at), vm); };
    int j = 0;
    for (; j + 4 * W <= n; j += 4 * W)
        if (anyTrue((same(j) | same(j + W)) | (same(j + 2 * W) | same(j + 3 * W)))) break;
    for (; j + W <= n; j += W) {
        const V hit = same(j);
        if (anyTrue(hit)) return j + firstTrue(hit);
    }
    for (; j < n; ++j)
        if (s[j] == m) return j;
    return 0;  // not reached: m is one of the elements
}
#endif

// The index of the element kept by the sequential strict scan.
template <class T, bool Max>
int extremeIndex(const T* s, int n) {
#if ZOR_SIMD >= 1
    if constexpr (simd::kHas<T>) return extremeIndexSimd<T, Max>(s, n);
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
// The 32-bit lanes pairs(x) gives for the registers of 16-bit elements x =
// 0, L, 2L ... below n, summed exactly in 64 bits (Lane: int32_t or
// uint32_t, how the lanes extend); x ends where the registers ended.
template <class Lane, class Pairs>
int64_t sumOfPairs(int n, int& x, Pairs pairs) {
    using namespace simd;
    using Q = Vec<std::conditional_t<std::is_signed_v<Lane>, int64_t, uint64_t>>;
    constexpr int L = Vec<int16_t>::kLanes;
    Q lo = zero<Q>(), hi = lo;
    for (; x + L <= n; x += L) {
        const auto t = bitcast<Lane>(pairs(x));
        lo = lo + widenLo(t);
        hi = hi + widenHi(t);
    }
    return int64_t(reduceAdd(lo + hi));
}
#endif

// Sum of products.  pmaddwd pairs lie in [-2^31 + 2^16, 2^31]; only 2^31
// (two products of -32768 by -32768) wraps, so each pair is taken minus
// 2^16, which fits in 32 bits exactly, and the 2^16 added back at the end.
[[maybe_unused]] int64_t dot16(const int16_t* a, const int16_t* b, int n) {
    int64_t total = 0;
    int i = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    using V = Vec<int16_t>;
    using W = Vec<int32_t>;
    const W bias = set1<W>(65536);
    total = sumOfPairs<int32_t>(n, i, [&](int x) { return mulAddPairs(load<V>(a + x), load<V>(b + x)) - bias; });
    total += int64_t(i / 2) * 65536;
#endif
    for (; i < n; ++i) total += int32_t(a[i]) * int32_t(b[i]);
    return total;
}

// Sum of squares: pmaddwd pairs lie in [0, 2^31], exact as unsigned 32 bits.
[[maybe_unused]] int64_t sumSquares16(const int16_t* a, int n) {
    int64_t total = 0;
    int i = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    using V = Vec<int16_t>;
    total = sumOfPairs<uint32_t>(n, i, [&](int x) {
        const V v = load<V>(a + x);
        return mulAddPairs(v, v);
    });
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
    using namespace simd;
    using V = Vec<int16_t>;
    const V one = set1<V>(1);
    total = sumOfPairs<uint32_t>(n, i, [&](int x) {
        const V v = load<V>(a + x), sign = shr<15>(v);
        return mulAddPairs(v ^ sign, one) - mulAddPairs(sign, one);
    });
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

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
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
    *pNorm = toFloat(std::sqrt(sumOfTerms<Term::Square>(pSrc, pSrc, len)));
    return StatusOk;
}
Status ZOR_CALL zorsNormDiff_L2_32f(const float* pSrc1, const float* pSrc2, int len, float* pNorm) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pNorm), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pNorm = toFloat(std::sqrt(sumOfTerms<Term::DiffSquare>(pSrc1, pSrc2, len)));
    return StatusOk;
}
Status ZOR_CALL zorsDotProd_32f(const float* pSrc1, const float* pSrc2, int len, float* pDp) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDp), badLength(len))) return s;
    DoublePrecisionScope precision;
    *pDp = toFloat(sumOfTerms<Term::Product>(pSrc1, pSrc2, len));
    return StatusOk;
}
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

Status ZOR_CALL zorsMax_32f(const float* pSrc, int len, float* pMax) {
    return extremeOf<float, true>(pSrc, len, pMax);
}
Status ZOR_CALL zorsMin_32f(const float* pSrc, int len, float* pMin) {
    return extremeOf<float, false>(pSrc, len, pMin);
}
Status ZOR_CALL zorsMaxIndx_32f(const float* pSrc, int len, float* pMax, int* pIndx) {
    return extremeOf<float, true>(pSrc, len, pMax, pIndx);
}

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
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
