// Vector arithmetic and elementwise math.
//
// Float results are the double-precision result rounded once to float.  For
// a single +, -, *, / or square root of floats that is exactly what the float
// operation gives (double carries more than twice the float precision), so
// those run as plain float SIMD from the SSE variant on.  Chains of double
// operations (normalise, power spectrum, magnitude) run as double SIMD from
// SSE2 on; the logarithm and the arctangent use an accurate double
// approximation whose float rounding is provably that of the standard
// library's function, and fall back to the library for the rare elements
// where the approximation cannot decide the rounding.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/status.h"

#include <cmath>
#include <cstddef>
#include <cstring>
#include <limits>

namespace zor { namespace ZOR_NS {
namespace {

inline uint32_t bitsOf(float x) {
    uint32_t u;
    std::memcpy(&u, &x, 4);
    return u;
}
inline float floatOf(uint32_t u) {
    float x;
    std::memcpy(&x, &u, 4);
    return x;
}

// The quiet NaN that square root and logarithm leave for negative inputs.
constexpr uint32_t kNegNaN = 0xFFC00000u;

// ---- elementwise float kernels ------------------------------------------------
//
// An operation is a small struct: operator() on scalars and, under SSE, vec()
// on four lanes.  The loops load before they store, so in-place calls (the
// same pointer as source and destination) are safe.  Operations are passed by
// value so that their constants stay in registers across the stores.

#if ZOR_SIMD >= 1
#  define ZOR_VEC1(expr) \
      __m128 vec(__m128 a) const { return expr; }
#  define ZOR_VEC2(expr) \
      __m128 vec(__m128 a, __m128 b) const { return expr; }
#else
#  define ZOR_VEC1(expr)
#  define ZOR_VEC2(expr)
#endif

template <class Op>
void map32f(const float* s, float* d, int n, const Op op) {
    int i = 0;
#if ZOR_SIMD >= 1
    for (; i + 8 <= n; i += 8) {
        const __m128 a = _mm_loadu_ps(s + i), b = _mm_loadu_ps(s + i + 4);
        _mm_storeu_ps(d + i, op.vec(a));
        _mm_storeu_ps(d + i + 4, op.vec(b));
    }
    for (; i + 4 <= n; i += 4) _mm_storeu_ps(d + i, op.vec(_mm_loadu_ps(s + i)));
#endif
    for (; i < n; ++i) d[i] = op(s[i]);
}

template <class Op>
void map32f(const float* s1, const float* s2, float* d, int n, const Op op) {
    int i = 0;
#if ZOR_SIMD >= 1
    for (; i + 8 <= n; i += 8) {
        const __m128 a0 = _mm_loadu_ps(s1 + i), a1 = _mm_loadu_ps(s1 + i + 4);
        const __m128 b0 = _mm_loadu_ps(s2 + i), b1 = _mm_loadu_ps(s2 + i + 4);
        _mm_storeu_ps(d + i, op.vec(a0, b0));
        _mm_storeu_ps(d + i + 4, op.vec(a1, b1));
    }
    for (; i + 4 <= n; i += 4)
        _mm_storeu_ps(d + i, op.vec(_mm_loadu_ps(s1 + i), _mm_loadu_ps(s2 + i)));
#endif
    for (; i < n; ++i) d[i] = op(s1[i], s2[i]);
}

struct AddF { float operator()(float a, float b) const { return a + b; } ZOR_VEC2(_mm_add_ps(a, b)) };
struct SubF { float operator()(float a, float b) const { return a - b; } ZOR_VEC2(_mm_sub_ps(a, b)) };
struct MulF { float operator()(float a, float b) const { return a * b; } ZOR_VEC2(_mm_mul_ps(a, b)) };
struct DivF { float operator()(float a, float b) const { return a / b; } ZOR_VEC2(_mm_div_ps(a, b)) };

// Operations with a constant keep it both as a scalar and broadcast.
struct ConstF {
    float c;
#if ZOR_SIMD >= 1
    __m128 vc;
    explicit ConstF(float v) : c(v), vc(_mm_set1_ps(v)) {}
#else
    explicit ConstF(float v) : c(v) {}
#endif
};
struct AddCF : ConstF { using ConstF::ConstF; float operator()(float a) const { return a + c; } ZOR_VEC1(_mm_add_ps(a, vc)) };
struct SubCF : ConstF { using ConstF::ConstF; float operator()(float a) const { return a - c; } ZOR_VEC1(_mm_sub_ps(a, vc)) };
struct MulCF : ConstF { using ConstF::ConstF; float operator()(float a) const { return a * c; } ZOR_VEC1(_mm_mul_ps(a, vc)) };

struct SqrF { float operator()(float a) const { return a * a; } ZOR_VEC1(_mm_mul_ps(a, a)) };

// Absolute value clears the sign bit, NaNs included.
struct AbsF {
    float operator()(float a) const { return floatOf(bitsOf(a) & 0x7FFFFFFFu); }
    ZOR_VEC1(_mm_andnot_ps(_mm_set1_ps(-0.0f), a))
};

#if ZOR_SIMD >= 1
// a where mask is clear, b where it is set.
inline __m128 select(__m128 mask, __m128 a, __m128 b) {
    return _mm_or_ps(_mm_andnot_ps(mask, a), _mm_and_ps(mask, b));
}
#endif

// Clipping keeps NaN elements (no comparison holds for them).
struct ClipAbove : ConstF {
    using ConstF::ConstF;
    float operator()(float a) const { return a > c ? c : a; }
    ZOR_VEC1(select(_mm_cmpgt_ps(a, vc), a, vc))
};
struct ClipBelow : ConstF {
    using ConstF::ConstF;
    float operator()(float a) const { return a < c ? c : a; }
    ZOR_VEC1(select(_mm_cmplt_ps(a, vc), a, vc))
};
// Replaces every element that is not >= level (so NaNs too) by value.
struct BelowToValue : ConstF {
    float value;
#if ZOR_SIMD >= 1
    __m128 vvalue;
    BelowToValue(float level, float v) : ConstF(level), value(v), vvalue(_mm_set1_ps(v)) {}
#else
    BelowToValue(float level, float v) : ConstF(level), value(v) {}
#endif
    float operator()(float a) const { return a >= c ? a : value; }
    ZOR_VEC1(select(_mm_cmpnge_ps(a, vc), a, vvalue))
};

void copy32f(const float* s, float* d, int n) {
    if (s != d) std::memmove(d, s, static_cast<size_t>(n) * sizeof(float));
}
void zero32f(float* d, int n) { std::memset(d, 0, static_cast<size_t>(n) * sizeof(float)); }

// ---- 16-bit integer kernels ---------------------------------------------------

#if ZOR_SIMD >= 2
#  define ZOR_VEC16_1(expr) \
      __m128i vec(__m128i a) const { return expr; }
#  define ZOR_VEC16_2(expr) \
      __m128i vec(__m128i a, __m128i b) const { return expr; }
#else
#  define ZOR_VEC16_1(expr)
#  define ZOR_VEC16_2(expr)
#endif

template <class Op>
void map16s(const int16_t* s, int16_t* d, int n, const Op op) {
    int i = 0;
#if ZOR_SIMD >= 2
    if (op.simd()) {
        for (; i + 8 <= n; i += 8) {
            const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s + i));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(d + i), op.vec(a));
        }
    }
#endif
    for (; i < n; ++i) d[i] = op(s[i]);
}

template <class Op>
void map16s(const int16_t* s1, const int16_t* s2, int16_t* d, int n, const Op op) {
    int i = 0;
#if ZOR_SIMD >= 2
    if (op.simd()) {
        for (; i + 16 <= n; i += 16) {
            const __m128i a0 = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s1 + i));
            const __m128i b0 = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s2 + i));
            const __m128i a1 = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s1 + i + 8));
            const __m128i b1 = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s2 + i + 8));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(d + i), op.vec(a0, b0));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(d + i + 8), op.vec(a1, b1));
        }
        for (; i + 8 <= n; i += 8) {
            const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s1 + i));
            const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(s2 + i));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(d + i), op.vec(a, b));
        }
    }
#endif
    for (; i < n; ++i) d[i] = op(s1[i], s2[i]);
}

// |x| with -32768 saturating to 32767: max(x, 0 -sat x).
struct Abs16 {
    bool simd() const { return true; }
    int16_t operator()(int16_t a) const { return saturate<int16_t>(a < 0 ? -int32_t(a) : int32_t(a)); }
    ZOR_VEC16_1(_mm_max_epi16(a, _mm_subs_epi16(_mm_setzero_si128(), a)))
};

// Saturated sum with a constant (a difference is a sum with -val, formed
// in 32 bits so that -(-32768) is exact).
struct AddC16 {
    int32_t c;
    bool simd() const { return c >= -32768 && c <= 32767; }
    int16_t operator()(int16_t a) const { return saturate<int16_t>(int32_t(a) + c); }
#if ZOR_SIMD >= 2
    __m128i vec(__m128i a) const { return _mm_adds_epi16(a, _mm_set1_epi16(static_cast<int16_t>(c))); }
#endif
};

// Sum of two vectors scaled by 2^-sf with ties to even (see zorsAdd_16s_Sfs).
struct AddSfs16 {
    int sf;
    bool simd() const { return true; }
    int16_t operator()(int16_t a, int16_t b) const {
        return saturate<int16_t>(scaleRound(int32_t(a) + int32_t(b), sf));
    }
#if ZOR_SIMD >= 2
    __m128i vec(__m128i a, __m128i b) const {
        if (sf == 0) return _mm_adds_epi16(a, b);
        if (sf > 16) return _mm_setzero_si128();
        if (sf <= -16) {
            // Only the sign of the sum survives; the saturating sum keeps it.
            const __m128i s = _mm_adds_epi16(a, b), z = _mm_setzero_si128();
            const __m128i pos = _mm_and_si128(_mm_cmpgt_epi16(s, z), _mm_set1_epi16(32767));
            const __m128i neg = _mm_and_si128(_mm_cmplt_epi16(s, z), _mm_set1_epi16(-32768));
            return _mm_or_si128(pos, neg);
        }
        // Widen to 32 bits: the low/high halves sign-extended.
        __m128i lo = _mm_add_epi32(_mm_srai_epi32(_mm_unpacklo_epi16(a, a), 16),
                                   _mm_srai_epi32(_mm_unpacklo_epi16(b, b), 16));
        __m128i hi = _mm_add_epi32(_mm_srai_epi32(_mm_unpackhi_epi16(a, a), 16),
                                   _mm_srai_epi32(_mm_unpackhi_epi16(b, b), 16));
        if (sf < 0) {
            const __m128i cnt = _mm_cvtsi32_si128(-sf);
            lo = _mm_sll_epi32(lo, cnt);
            hi = _mm_sll_epi32(hi, cnt);
        } else {
            const __m128i cnt = _mm_cvtsi32_si128(sf);
            const __m128i half = _mm_set1_epi32((1 << (sf - 1)) - 1), one = _mm_set1_epi32(1);
            lo = _mm_sra_epi32(_mm_add_epi32(_mm_add_epi32(lo, half),
                                             _mm_and_si128(_mm_sra_epi32(lo, cnt), one)), cnt);
            hi = _mm_sra_epi32(_mm_add_epi32(_mm_add_epi32(hi, half),
                                             _mm_and_si128(_mm_sra_epi32(hi, cnt), one)), cnt);
        }
        return _mm_packs_epi32(lo, hi);
    }
#endif
};

// Product scaled by 2^-sf, rounded half up (toward +inf), saturated.  The
// SIMD path covers 0 <= sf <= 30, where p + 2^(sf-1) stays inside 32 bits.
struct MulNR16 {
    int sf;
#if ZOR_SIMD >= 2
    __m128i cnt, half;
    explicit MulNR16(int scale)
        : sf(scale), cnt(_mm_cvtsi32_si128(scale)),
          half(_mm_set1_epi32(scale > 0 && scale <= 30 ? 1 << (scale - 1) : 0)) {}
#else
    explicit MulNR16(int scale) : sf(scale) {}
#endif
    bool simd() const { return sf <= 30; }
    int16_t operator()(int16_t a, int16_t b) const {
        return saturate<int16_t>(scaleRoundHalfUp(int32_t(a) * int32_t(b), sf));
    }
#if ZOR_SIMD >= 2
    __m128i vec(__m128i a, __m128i b) const {
        const __m128i pl = _mm_mullo_epi16(a, b), ph = _mm_mulhi_epi16(a, b);
        __m128i lo = _mm_unpacklo_epi16(pl, ph), hi = _mm_unpackhi_epi16(pl, ph);
        // With sf 0 both the half and the shift are 0.
        lo = _mm_sra_epi32(_mm_add_epi32(lo, half), cnt);
        hi = _mm_sra_epi32(_mm_add_epi32(hi, half), cnt);
        return _mm_packs_epi32(lo, hi);
    }
#endif
};
struct MulCNR16 : MulNR16 {
    int16_t c;
    MulCNR16(int scale, int16_t v) : MulNR16(scale), c(v) {}
    int16_t operator()(int16_t a) const { return MulNR16::operator()(a, c); }
#if ZOR_SIMD >= 2
    __m128i vec(__m128i a) const { return MulNR16::vec(a, _mm_set1_epi16(c)); }
#endif
};

// ---- 64-bit float absolute value ---------------------------------------------

[[maybe_unused]] void abs64f(const double* s, double* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    const __m128d m = _mm_castsi128_pd(_mm_set1_epi64x(0x7FFFFFFFFFFFFFFFll));
    for (; i + 4 <= n; i += 4) {
        const __m128d a = _mm_loadu_pd(s + i), b = _mm_loadu_pd(s + i + 2);
        _mm_storeu_pd(d + i, _mm_and_pd(a, m));
        _mm_storeu_pd(d + i + 2, _mm_and_pd(b, m));
    }
#endif
    for (; i < n; ++i) {
        uint64_t u;
        std::memcpy(&u, s + i, 8);
        u &= 0x7FFFFFFFFFFFFFFFull;
        std::memcpy(d + i, &u, 8);
    }
}

// ---- square root and logarithm -------------------------------------------------

void sqrtInPlace(float* p, int n, bool& negative) {
    int i = 0;
#if ZOR_SIMD >= 1
    const __m128 zero = _mm_setzero_ps(), nan = _mm_set1_ps(floatOf(kNegNaN));
    __m128 seen = _mm_setzero_ps();
    for (; i + 4 <= n; i += 4) {
        const __m128 x = _mm_loadu_ps(p + i);
        const __m128 bad = _mm_cmpnge_ps(x, zero);  // negative or NaN
        seen = _mm_or_ps(seen, bad);
        _mm_storeu_ps(p + i, select(bad, _mm_sqrt_ps(x), nan));
    }
    if (_mm_movemask_ps(seen)) negative = true;
#endif
    for (; i < n; ++i) {
        if (p[i] >= 0.0f) {
            p[i] = std::sqrt(p[i]);  // +-0 stays as it is
        } else {
            p[i] = floatOf(kNegNaN);
            negative = true;
        }
    }
}

// One element of the logarithm with its special cases; `first` records the
// first special condition of the vector.
inline float lnElement(float x, Status& first) {
    const uint32_t u = bitsOf(x);
    if (u & 0x80000000u) {  // every negative number, -0.0 and negative NaNs
        if (first == StatusOk) first = StatusWarnLnNegative;
        return floatOf(kNegNaN);
    }
    if (u > 0x7F800000u) return floatOf(u | 0x00400000u);  // NaN: quieted
    if (u == 0) {
        if (first == StatusOk) first = StatusWarnLnZero;
        return -std::numeric_limits<float>::infinity();
    }
    return toFloat(std::log(static_cast<double>(x)));
}

#if ZOR_SIMD >= 2
// Both ends of y -/+ |y| 2^-40 round to the same float in every lane.  The
// approximations below are accurate to far better than 2^-40 relative, the
// standard library to 2^-52, so then the library's result rounds to the
// same float as the approximation.
inline bool roundingDecided(__m128d y0, __m128d y1) {
    const __m128d absMask = _mm_castsi128_pd(_mm_set1_epi64x(0x7FFFFFFFFFFFFFFFll));
    const __m128d rel = _mm_set1_pd(0x1p-40);
    const __m128d t0 = _mm_mul_pd(_mm_and_pd(y0, absMask), rel);
    const __m128d t1 = _mm_mul_pd(_mm_and_pd(y1, absMask), rel);
    const __m128 lo = _mm_movelh_ps(_mm_cvtpd_ps(_mm_sub_pd(y0, t0)), _mm_cvtpd_ps(_mm_sub_pd(y1, t1)));
    const __m128 hi = _mm_movelh_ps(_mm_cvtpd_ps(_mm_add_pd(y0, t0)), _mm_cvtpd_ps(_mm_add_pd(y1, t1)));
    return _mm_movemask_ps(_mm_cmpeq_ps(lo, hi)) == 0xF;
}

// log(c) and 1/c for c = 1 + k/128, k = 0..128, interleaved.
struct LnTable {
    alignas(16) double e[129][2];
    LnTable() {
        for (int k = 0; k <= 128; ++k) {
            const double c = 1.0 + k / 128.0;
            e[k][0] = 1.0 / c;
            e[k][1] = k == 128 ? 0x1.62e42fefa39efp-1 : std::log(c);  // log 2 as below, so log(1 - tiny) cancels exactly
        }
    }
};
const LnTable& lnTable() {
    static const LnTable t;
    return t;
}

// log of two positive normal floats, given as e (unbiased exponent), d = m - c
// (exact in float, |d| <= 2^-8) and the table rows k.
inline __m128d lnPair(const LnTable& t, __m128i e, __m128 d, int k0, int k1) {
    const __m128d r0 = _mm_load_pd(t.e[k0]), r1 = _mm_load_pd(t.e[k1]);
    const __m128d inv = _mm_unpacklo_pd(r0, r1), logc = _mm_unpackhi_pd(r0, r1);
    const __m128d r = _mm_mul_pd(_mm_cvtps_pd(d), inv);  // |r| <= 2^-8
    // log(1 + r) to degree 6: the remainder r^7/7 is below 2^-50 |r|.
    __m128d p = _mm_set1_pd(-1.0 / 6);
    p = _mm_add_pd(_mm_mul_pd(p, r), _mm_set1_pd(1.0 / 5));
    p = _mm_add_pd(_mm_mul_pd(p, r), _mm_set1_pd(-0.25));
    p = _mm_add_pd(_mm_mul_pd(p, r), _mm_set1_pd(1.0 / 3));
    p = _mm_add_pd(_mm_mul_pd(p, r), _mm_set1_pd(-0.5));
    p = _mm_mul_pd(_mm_add_pd(_mm_mul_pd(p, r), _mm_set1_pd(1.0)), r);
    const __m128d ln2 = _mm_set1_pd(0x1.62e42fefa39efp-1);
    return _mm_add_pd(_mm_add_pd(_mm_mul_pd(_mm_cvtepi32_pd(e), ln2), logc), p);
}
#endif

[[maybe_unused]] Status lnInPlace(float* p, int n) {
    Status first = StatusOk;
    int i = 0;
#if ZOR_SIMD >= 2
    const LnTable& t = lnTable();
    for (; i + 4 <= n; i += 4) {
        const __m128i u = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i));
        // Positive normal finite floats only; everything else element by element.
        const __m128i ok = _mm_and_si128(_mm_cmpgt_epi32(u, _mm_set1_epi32(0x007FFFFF)),
                                         _mm_cmplt_epi32(u, _mm_set1_epi32(0x7F800000)));
        if (_mm_movemask_epi8(ok) == 0xFFFF) {
            const __m128i mant = _mm_and_si128(u, _mm_set1_epi32(0x007FFFFF));
            const __m128i k = _mm_srli_epi32(_mm_add_epi32(mant, _mm_set1_epi32(0x8000)), 16);
            const __m128i e = _mm_sub_epi32(_mm_srli_epi32(u, 23), _mm_set1_epi32(127));
            const __m128 m = _mm_castsi128_ps(_mm_or_si128(mant, _mm_set1_epi32(0x3F800000)));
            const __m128 c = _mm_castsi128_ps(_mm_add_epi32(_mm_slli_epi32(k, 16), _mm_set1_epi32(0x3F800000)));
            const __m128 d = _mm_sub_ps(m, c);  // exact: m and c are within 2^-8 of each other
            alignas(16) int32_t ks[4];
            _mm_store_si128(reinterpret_cast<__m128i*>(ks), k);
            const __m128d y0 = lnPair(t, e, d, ks[0], ks[1]);
            const __m128d y1 = lnPair(t, _mm_shuffle_epi32(e, 0xEE), _mm_movehl_ps(d, d), ks[2], ks[3]);
            if (roundingDecided(y0, y1)) {
                _mm_storeu_ps(p + i, _mm_movelh_ps(_mm_cvtpd_ps(y0), _mm_cvtpd_ps(y1)));
                continue;
            }
        }
        for (int j = i; j < i + 4; ++j) p[j] = lnElement(p[j], first);
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) p[i] = lnElement(p[i], first);
    return first;
}

// ---- arctangent -----------------------------------------------------------------

inline float atan2Element(float y, float x) {
    return toFloat(std::atan2(static_cast<double>(y), static_cast<double>(x)));
}

#if ZOR_SIMD >= 2
// atan(k/32), k = 0..32.
struct AtanTable {
    double v[33];
    AtanTable() {
        for (int k = 0; k <= 32; ++k) v[k] = std::atan(k / 32.0);
    }
};
const AtanTable& atanTable() {
    static const AtanTable t;
    return t;
}

// atan2(y, x) for two pairs of finite non-zero floats (widened to double).
inline __m128d atan2Pair(const AtanTable& t, __m128d y, __m128d x, __m128i k) {
    const __m128d absMask = _mm_castsi128_pd(_mm_set1_epi64x(0x7FFFFFFFFFFFFFFFll));
    const __m128d ay = _mm_and_pd(y, absMask), ax = _mm_and_pd(x, absMask);
    const __m128d num = _mm_min_pd(ay, ax), den = _mm_max_pd(ay, ax);
    // t = num/den in [0, 1]; with c = k/32 close to t,
    // atan(t) = atan(c) + atan((t - c) / (1 + t c)) = atan(c) + atan((num - c den) / (den + c num)).
    const __m128d c = _mm_mul_pd(_mm_cvtepi32_pd(k), _mm_set1_pd(1.0 / 32));
    const __m128d dd = _mm_div_pd(_mm_sub_pd(num, _mm_mul_pd(c, den)), _mm_add_pd(den, _mm_mul_pd(c, num)));
    const __m128d d2 = _mm_mul_pd(dd, dd);
    // |dd| < 2^-5.9: atan to degree 7, the remainder d^9/9 below 2^-50 |dd|.
    __m128d q = _mm_set1_pd(-1.0 / 7);
    q = _mm_add_pd(_mm_mul_pd(q, d2), _mm_set1_pd(1.0 / 5));
    q = _mm_sub_pd(_mm_mul_pd(q, d2), _mm_set1_pd(1.0 / 3));
    q = _mm_add_pd(_mm_mul_pd(_mm_mul_pd(q, d2), dd), dd);
    alignas(16) int32_t ks[4];
    _mm_store_si128(reinterpret_cast<__m128i*>(ks), k);
    __m128d r = _mm_add_pd(_mm_set_pd(t.v[ks[1]], t.v[ks[0]]), q);
    // Octant and quadrant: |y| > |x| reflects about pi/4, x < 0 about pi/2.
    const __m128d steep = _mm_cmpgt_pd(ay, ax);
    r = _mm_or_pd(_mm_andnot_pd(steep, r),
                  _mm_and_pd(steep, _mm_sub_pd(_mm_set1_pd(0x1.921fb54442d18p+0), r)));
    const __m128d left = _mm_cmplt_pd(x, _mm_setzero_pd());
    r = _mm_or_pd(_mm_andnot_pd(left, r),
                  _mm_and_pd(left, _mm_sub_pd(_mm_set1_pd(0x1.921fb54442d18p+1), r)));
    return _mm_or_pd(r, _mm_andnot_pd(absMask, y));  // the sign of y
}
#endif

// dst = atan2(y, x), rounded to float.
[[maybe_unused]] void atan2Vec(const float* py, const float* px, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    const AtanTable& t = atanTable();
    const __m128i absMask = _mm_set1_epi32(0x7FFFFFFF);
    for (; i + 4 <= n; i += 4) {
        const __m128 yf = _mm_loadu_ps(py + i), xf = _mm_loadu_ps(px + i);
        const __m128i ya = _mm_and_si128(_mm_castps_si128(yf), absMask);
        const __m128i xa = _mm_and_si128(_mm_castps_si128(xf), absMask);
        // Zeros, infinities and NaNs take the library's own rules.
        const __m128i z = _mm_setzero_si128();
        const __m128i special = _mm_or_si128(
            _mm_or_si128(_mm_cmpeq_epi32(ya, z), _mm_cmpeq_epi32(xa, z)),
            _mm_or_si128(_mm_cmpgt_epi32(ya, _mm_set1_epi32(0x7F7FFFFF)),
                         _mm_cmpgt_epi32(xa, _mm_set1_epi32(0x7F7FFFFF))));
        if (_mm_movemask_epi8(special) == 0) {
            // The table row from a float estimate of the ratio; any row within
            // one of the nearest keeps |dd| small enough.
            const __m128 yaf = _mm_castsi128_ps(ya), xaf = _mm_castsi128_ps(xa);
            const __m128 tf = _mm_div_ps(_mm_min_ps(yaf, xaf), _mm_max_ps(yaf, xaf));
            const __m128i k = _mm_cvtps_epi32(_mm_mul_ps(tf, _mm_set1_ps(32.0f)));
            const __m128d r0 = atan2Pair(t, _mm_cvtps_pd(yf), _mm_cvtps_pd(xf), k);
            const __m128d r1 = atan2Pair(t, _mm_cvtps_pd(_mm_movehl_ps(yf, yf)),
                                         _mm_cvtps_pd(_mm_movehl_ps(xf, xf)),
                                         _mm_shuffle_epi32(k, 0xEE));
            if (roundingDecided(r0, r1)) {
                _mm_storeu_ps(d + i, _mm_movelh_ps(_mm_cvtpd_ps(r0), _mm_cvtpd_ps(r1)));
                continue;
            }
        }
        for (int j = i; j < i + 4; ++j) d[j] = atan2Element(py[j], px[j]);
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) d[i] = atan2Element(py[i], px[i]);
}

// ---- double-precision elementwise results --------------------------------------

// dst = sqrt(re^2 + im^2) or re^2 + im^2, each in double, rounded once.
template <bool Root>
void squaresSum(const float* re, const float* im, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    for (; i + 4 <= n; i += 4) {
        const __m128 r = _mm_loadu_ps(re + i), m = _mm_loadu_ps(im + i);
        const __m128d r0 = _mm_cvtps_pd(r), m0 = _mm_cvtps_pd(m);
        const __m128d r1 = _mm_cvtps_pd(_mm_movehl_ps(r, r)), m1 = _mm_cvtps_pd(_mm_movehl_ps(m, m));
        __m128d s0 = _mm_add_pd(_mm_mul_pd(r0, r0), _mm_mul_pd(m0, m0));
        __m128d s1 = _mm_add_pd(_mm_mul_pd(r1, r1), _mm_mul_pd(m1, m1));
        if (Root) {
            s0 = _mm_sqrt_pd(s0);
            s1 = _mm_sqrt_pd(s1);
        }
        _mm_storeu_ps(d + i, _mm_movelh_ps(_mm_cvtpd_ps(s0), _mm_cvtpd_ps(s1)));
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) {
        const double a = re[i], b = im[i];
        const double s = toDouble(a * a + b * b);
        d[i] = toFloat(Root ? std::sqrt(s) : s);
    }
}

[[maybe_unused]] void magnitudeComplex(const Complex32f* src, float* d, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    const float* p = reinterpret_cast<const float*>(src);
    for (; i + 4 <= n; i += 4) {
        const float* q = p + 2 * static_cast<ptrdiff_t>(i);
        const __m128 a = _mm_loadu_ps(q), b = _mm_loadu_ps(q + 4);
        __m128d q0 = _mm_cvtps_pd(a), q1 = _mm_cvtps_pd(_mm_movehl_ps(a, a));
        __m128d q2 = _mm_cvtps_pd(b), q3 = _mm_cvtps_pd(_mm_movehl_ps(b, b));
        q0 = _mm_mul_pd(q0, q0); q1 = _mm_mul_pd(q1, q1);
        q2 = _mm_mul_pd(q2, q2); q3 = _mm_mul_pd(q3, q3);
#  if ZOR_SIMD >= 3
        const __m128d s0 = _mm_hadd_pd(q0, q1), s1 = _mm_hadd_pd(q2, q3);
#  else
        const __m128d s0 = _mm_add_pd(_mm_unpacklo_pd(q0, q1), _mm_unpackhi_pd(q0, q1));
        const __m128d s1 = _mm_add_pd(_mm_unpacklo_pd(q2, q3), _mm_unpackhi_pd(q2, q3));
#  endif
        _mm_storeu_ps(d + i, _mm_movelh_ps(_mm_cvtpd_ps(_mm_sqrt_pd(s0)), _mm_cvtpd_ps(_mm_sqrt_pd(s1))));
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) {
        const double a = src[i].re, b = src[i].im;
        d[i] = toFloat(std::sqrt(toDouble(a * a + b * b)));
    }
}

// dst = (src - sub) * rcp, both steps in double.
[[maybe_unused]] void normalizeVec(const float* s, float* d, int n, float sub, double rcp) {
    int i = 0;
#if ZOR_SIMD >= 2
    const __m128d vs = _mm_set1_pd(sub), vr = _mm_set1_pd(rcp);
    for (; i + 4 <= n; i += 4) {
        const __m128 x = _mm_loadu_ps(s + i);
        const __m128d a = _mm_mul_pd(_mm_sub_pd(_mm_cvtps_pd(x), vs), vr);
        const __m128d b = _mm_mul_pd(_mm_sub_pd(_mm_cvtps_pd(_mm_movehl_ps(x, x)), vs), vr);
        _mm_storeu_ps(d + i, _mm_movelh_ps(_mm_cvtpd_ps(a), _mm_cvtpd_ps(b)));
    }
#else
    DoublePrecisionScope precision;
#endif
    for (; i < n; ++i) d[i] = toFloat(toDouble(static_cast<double>(s[i]) - sub) * rcp);
}

// ---- sort -------------------------------------------------------------------------

#if ZOR_VARIANT == 0
inline void swapAt(float* a, int i, int j) {
    const float t = a[i];
    a[i] = a[j];
    a[j] = t;
}

// Descending quicksort without recursion: median-of-three pivot, the larger
// part stacked and the smaller one done first (so 32 entries cover any int
// length), short runs finished by selection sort.  Every scan stops at an
// element that does not compare past the pivot (the pivot itself, then the
// last swapped pair), so NaNs cannot run it off the partition.
void sortDescend(float* a, int n) {
    struct Range { int lo, hi; };
    Range stack[32];
    int top = 0;
    int lo = 0, hi = n - 1;
    for (;;) {
        while (hi - lo + 1 > 9) {
            const int mid = lo + (hi - lo) / 2;
            if (a[mid] > a[lo]) swapAt(a, lo, mid);
            if (a[hi] > a[mid]) {
                swapAt(a, mid, hi);
                if (a[mid] > a[lo]) swapAt(a, lo, mid);
            }
            const float pivot = a[mid];
            int i = lo, j = hi;
            for (;;) {
                do ++i; while (a[i] > pivot);
                do --j; while (pivot > a[j]);
                if (i >= j) break;
                swapAt(a, i, j);
            }
            // [lo, j] holds the larger elements, [j + 1, hi] the smaller.
            if (j - lo < hi - j) {
                stack[top++] = Range{j + 1, hi};
                hi = j;
            } else {
                stack[top++] = Range{lo, j};
                lo = j + 1;
            }
        }
        // Selection sort: the smallest remaining element goes to the end.
        for (int end = hi; end > lo; --end) {
            int m = lo;
            float v = a[lo];
            for (int k = lo + 1; k <= end; ++k) {
                const float x = a[k];
                const bool smaller = x < v;  // selects, not branches: the outcome is random
                v = smaller ? x : v;
                m = smaller ? k : m;
            }
            a[m] = a[end];
            a[end] = v;
        }
        if (top == 0) break;
        --top;
        lo = stack[top].lo;
        hi = stack[top].hi;
    }
}
#endif

// ---- deinterleave -------------------------------------------------------------------

[[maybe_unused]] void deinterleave2(const int16_t* s, int16_t* d0, int16_t* d1, int n) {
    int i = 0;
#if ZOR_SIMD >= 2
    for (; i + 8 <= n; i += 8) {
        const int16_t* p = s + 2 * static_cast<ptrdiff_t>(i);
        const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + 8));
        // Even elements sign-extended from the low halves, odd ones from the high.
        const __m128i e = _mm_packs_epi32(_mm_srai_epi32(_mm_slli_epi32(a, 16), 16),
                                          _mm_srai_epi32(_mm_slli_epi32(b, 16), 16));
        const __m128i o = _mm_packs_epi32(_mm_srai_epi32(a, 16), _mm_srai_epi32(b, 16));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(d0 + i), e);
        _mm_storeu_si128(reinterpret_cast<__m128i*>(d1 + i), o);
    }
#endif
    for (; i < n; ++i) {
        d0[i] = s[2 * static_cast<ptrdiff_t>(i)];
        d1[i] = s[2 * static_cast<ptrdiff_t>(i) + 1];
    }
}

[[maybe_unused]] bool misaligned16(const void* p) { return (reinterpret_cast<uintptr_t>(p) & 15) != 0; }

}  // namespace

// ---- exports ---------------------------------------------------------------------------

Status ZOR_CALL zorsAdd_32f(const float* pSrc1, const float* pSrc2, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDst), badLength(len))) return s;
    map32f(pSrc1, pSrc2, pDst, len, AddF{});
    return StatusOk;
}
Status ZOR_CALL zorsAdd_32f_I(const float* pSrc, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrc, pSrcDst, len, AddF{});
    return StatusOk;
}
Status ZOR_CALL zorsSub_32f_I(const float* pSrc, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrc, pSrcDst, len, SubF{});
    return StatusOk;
}
Status ZOR_CALL zorsMul_32f_I(const float* pSrc, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrc, pSrcDst, len, MulF{});
    return StatusOk;
}
// No check for zero divisors: IEEE infinities and NaNs result.
Status ZOR_CALL zorsDiv_32f_I(const float* pSrc, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrc, pSrcDst, len, DivF{});
    return StatusOk;
}

// The constant shortcuts (add 0, multiply by 1 or 0, subtract 0) skip the
// arithmetic altogether: NaN payloads and -0.0 survive a copy, and an
// infinite or NaN element times 0 becomes 0.
Status ZOR_CALL zorsAddC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0.0f) return StatusOk;
    map32f(pSrcDst, pSrcDst, len, AddCF(val));
    return StatusOk;
}
Status ZOR_CALL zorsSubC_32f(const float* pSrc, float val, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (val == 0.0f)
        copy32f(pSrc, pDst, len);
    else
        map32f(pSrc, pDst, len, SubCF(val));
    return StatusOk;
}
Status ZOR_CALL zorsSubC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrcDst, len, SubCF(val));
    return StatusOk;
}
Status ZOR_CALL zorsMulC_32f(const float* pSrc, float val, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (val == 1.0f)
        copy32f(pSrc, pDst, len);
    else if (val == 0.0f)
        zero32f(pDst, len);
    else
        map32f(pSrc, pDst, len, MulCF(val));
    return StatusOk;
}
Status ZOR_CALL zorsMulC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 1.0f) return StatusOk;
    if (val == 0.0f)
        zero32f(pSrcDst, len);
    else
        map32f(pSrcDst, pSrcDst, len, MulCF(val));
    return StatusOk;
}
// Division by a constant multiplies by its float reciprocal (formed in double
// and rounded once), through the multiply with its shortcuts: a divisor of 1
// copies, an infinite divisor zeroes.  The last bit may differ from a true
// division; that is the documented behaviour.
Status ZOR_CALL zorsDivC_32f(const float* pSrc, float val, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (val == 0.0f || val != val) return StatusDivideByZero;
    return zorsMulC_32f(pSrc, toFloat(1.0 / static_cast<double>(val)), pDst, len);
}
Status ZOR_CALL zorsDivC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0.0f || val != val) return StatusDivideByZero;
    return zorsMulC_32f(pSrcDst, toFloat(1.0 / static_cast<double>(val)), pSrcDst, len);
}

#if ZOR_VARIANT != 1
Status ZOR_CALL zorsAdd_16s_Sfs(const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len,
                                int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDst), badLength(len))) return s;
    if (scaleFactor > 16) {  // every scaled sum rounds to 0
        std::memset(pDst, 0, static_cast<size_t>(len) * sizeof(int16_t));
        return StatusOk;
    }
    map16s(pSrc1, pSrc2, pDst, len, AddSfs16{scaleFactor});
    return StatusOk;
}
Status ZOR_CALL zorsAddC_16s_I(int16_t val, int16_t* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0) return StatusOk;
    map16s(pSrcDst, pSrcDst, len, AddC16{val});
    return StatusOk;
}
Status ZOR_CALL zorsSubC_16s_I(int16_t val, int16_t* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0) return StatusOk;
    map16s(pSrcDst, pSrcDst, len, AddC16{-int32_t(val)});
    return StatusOk;
}

// The _NR multiplies refuse negative scale factors after the pointer and
// length checks.
Status ZOR_CALL zorsMul_NR_16s_Sfs(const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len,
                                   int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    map16s(pSrc1, pSrc2, pDst, len, MulNR16(scaleFactor));
    return StatusOk;
}
Status ZOR_CALL zorsMul_NR_16s_ISfs(const int16_t* pSrc, int16_t* pSrcDst, int len, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    map16s(pSrc, pSrcDst, pSrcDst, len, MulNR16(scaleFactor));
    return StatusOk;
}
Status ZOR_CALL zorsMulC_NR_16s_Sfs(const int16_t* pSrc, int16_t val, int16_t* pDst, int len,
                                    int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    map16s(pSrc, pDst, len, MulCNR16(scaleFactor, val));
    return StatusOk;
}
Status ZOR_CALL zorsMulC_NR_16s_ISfs(int16_t val, int16_t* pSrcDst, int len, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    map16s(pSrcDst, pSrcDst, len, MulCNR16(scaleFactor, val));
    return StatusOk;
}

Status ZOR_CALL zorsAbs_16s(const int16_t* pSrc, int16_t* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    map16s(pSrc, pDst, len, Abs16{});
    return StatusOk;
}
Status ZOR_CALL zorsAbs_16s_I(int16_t* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    map16s(pSrcDst, pSrcDst, len, Abs16{});
    return StatusOk;
}
Status ZOR_CALL zorsAbs_64f(const double* pSrc, double* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    abs64f(pSrc, pDst, len);
    return StatusOk;
}
Status ZOR_CALL zorsAbs_64f_I(double* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    abs64f(pSrcDst, pSrcDst, len);
    return StatusOk;
}
#endif  // ZOR_VARIANT != 1

Status ZOR_CALL zorsAbs_32f(const float* pSrc, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    map32f(pSrc, pDst, len, AbsF{});
    return StatusOk;
}
Status ZOR_CALL zorsAbs_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrcDst, len, AbsF{});
    return StatusOk;
}
Status ZOR_CALL zorsSqr_32f(const float* pSrc, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    map32f(pSrc, pDst, len, SqrF{});
    return StatusOk;
}
Status ZOR_CALL zorsSqr_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrcDst, len, SqrF{});
    return StatusOk;
}
// Negative elements and NaNs become the quiet NaN 0xFFC00000; +-0 stays.
Status ZOR_CALL zorsSqrt_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    bool negative = false;
    sqrtInPlace(pSrcDst, len, negative);
    return negative ? StatusWarnSqrtNegative : StatusOk;
}

// relOp CmpGreater (4) clips from above, any other value from below.
Status ZOR_CALL zorsThreshold_32f_I(float* pSrcDst, int len, float level, int relOp) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (relOp == CmpGreater)
        map32f(pSrcDst, pSrcDst, len, ClipAbove(level));
    else
        map32f(pSrcDst, pSrcDst, len, ClipBelow(level));
    return StatusOk;
}
Status ZOR_CALL zorsThreshold_LTVal_32f(const float* pSrc, float* pDst, int len, float level, float value) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    map32f(pSrc, pDst, len, BelowToValue(level, value));
    return StatusOk;
}
Status ZOR_CALL zorsThreshold_LTVal_32f_I(float* pSrcDst, int len, float level, float value) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    map32f(pSrcDst, pSrcDst, len, BelowToValue(level, value));
    return StatusOk;
}

#if ZOR_VARIANT != 1
// The logarithm reports the first special element it met: a zero
// (StatusWarnLnZero) or anything with the sign bit set (StatusWarnLnNegative).
Status ZOR_CALL zorsLn_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    return lnInPlace(pSrcDst, len);
}

// A divisor below the smallest normal float in magnitude is refused.
Status ZOR_CALL zorsNormalize_32f(const float* pSrc, float* pDst, int len, float vSub, float vDiv) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (!(std::fabs(static_cast<double>(vDiv)) >= 1.1754943508222875e-38)) return StatusDivideByZero;
    DoublePrecisionScope precision;
    normalizeVec(pSrc, pDst, len, vSub, toDouble(1.0 / static_cast<double>(vDiv)));
    return StatusOk;
}

Status ZOR_CALL zorsMagnitude_32f(const float* pSrcRe, const float* pSrcIm, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcRe, pSrcIm, pDst), badLength(len))) return s;
    squaresSum<true>(pSrcRe, pSrcIm, pDst, len);
    return StatusOk;
}
Status ZOR_CALL zorsMagnitude_32fc(const Complex32f* pSrc, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    magnitudeComplex(pSrc, pDst, len);
    return StatusOk;
}
Status ZOR_CALL zorsPowerSpectr_32f(const float* pSrcRe, const float* pSrcIm, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcRe, pSrcIm, pDst), badLength(len))) return s;
    squaresSum<false>(pSrcRe, pSrcIm, pDst, len);
    return StatusOk;
}
// Phase in -pi .. pi: atan2(im, re) in double, rounded to float.
Status ZOR_CALL zorsPhase_32f(const float* pSrcRe, const float* pSrcIm, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcRe, pSrcIm, pDst), badLength(len))) return s;
    atan2Vec(pSrcIm, pSrcRe, pDst, len);
    return StatusOk;
}
// pSrc1 holds the ordinates (y) and pSrc2 the abscissae (x): dst = atan2(y, x).
// The length is checked before the pointers.  The result is the correctly
// rounded float of the double-precision arctangent, well inside the 21-bit
// class, and the same as zorsPhase_32f(pSrc2, pSrc1, ...).
Status ZOR_CALL zorsAtan2_32f_A21(const float* pSrc1, const float* pSrc2, float* pDst, int len) {
    if (Status s = checkFirst(badLength(len), anyNull(pSrc1, pSrc2, pDst))) return s;
    DoublePrecisionScope precision;
    atan2Vec(pSrc1, pSrc2, pDst, len);
    return StatusOk;
}

// dstArray[c][i] = src[i * channels + c] for i < len; the work is done in full
// and a source or destination address off a 16-byte boundary is reported
// with StatusWarnMisaligned.
Status ZOR_CALL zorsDeinterleave_16s(const int16_t* pSrc, int channels, int len, int16_t** pDst) {
    if (!pDst || !pSrc) return StatusNullPointer;
    if (channels < 1) return StatusBadChannelCount;
    if (len < 1) return StatusBadSize;
    bool misaligned = misaligned16(pSrc);
    for (int c = 0; c < channels; ++c) {
        if (!pDst[c]) return StatusNullPointer;
        misaligned = misaligned || misaligned16(pDst[c]);
    }
    if (channels == 2) {
        deinterleave2(pSrc, pDst[0], pDst[1], len);
    } else {
        for (int c = 0; c < channels; ++c) {
            int16_t* d = pDst[c];
            const int16_t* s = pSrc + c;
            for (int i = 0; i < len; ++i) d[i] = s[static_cast<ptrdiff_t>(i) * channels];
        }
    }
    return misaligned ? StatusWarnMisaligned : StatusOk;
}
#endif  // ZOR_VARIANT != 1

#if ZOR_VARIANT == 0
// Sorting is the same comparison sequence on every processor.
Status ZOR_CALL zorsSortDescend_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (len > 1) sortDescend(pSrcDst, len);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
