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
#include "frame/simd.h"
#include "signal/vector/arith_kernels.h"

#include <cmath>
#include <cstddef>
#include <cstring>
#include <limits>

namespace zor { namespace ZOR_NS {
namespace {

// ---- elementwise operations -----------------------------------------------
//
// Each operation is written once, as a generic lambda (or a struct with a
// lane and a register overload) over the lane vocabulary, and run by
// simd::mapLanes: registers from the column that has them (floats from SSE,
// 16-bit lanes from SSE2), single elements for the rest.  mapLanes loads
// before it stores, so in-place calls (the same pointer as source and
// destination) are safe.

constexpr auto kAdd = [](auto a, auto b) { return a + b; };
constexpr auto kSub = [](auto a, auto b) { return a - b; };
constexpr auto kMul = [](auto a, auto b) { return a * b; };
constexpr auto kDiv = [](auto a, auto b) { return a / b; };
constexpr auto kSquare = [](auto a) { return a * a; };
// Float absolute value clears the sign bit, NaNs included.
constexpr auto kAbs = [](auto a) { return simd::abs(a); };

// Operations with a constant c.
inline auto addConst(float c) { return [c](auto a) { return a + simd::set1<decltype(a)>(c); }; }
inline auto subConst(float c) { return [c](auto a) { return a - simd::set1<decltype(a)>(c); }; }
inline auto mulConst(float c) { return [c](auto a) { return a * simd::set1<decltype(a)>(c); }; }

// Clipping keeps NaN elements (no comparison holds for them).
inline auto clipAbove(float c) {
    return [c](auto a) {
        const auto v = simd::set1<decltype(a)>(c);
        return simd::select(simd::gt(a, v), v, a);
    };
}
inline auto clipBelow(float c) {
    return [c](auto a) {
        const auto v = simd::set1<decltype(a)>(c);
        return simd::select(simd::lt(a, v), v, a);
    };
}
// Replaces every element that is not >= level (so NaNs too) by value.
inline auto belowToValue(float level, float value) {
    return [level, value](auto a) {
        using A = decltype(a);
        return simd::select(simd::ge(a, simd::set1<A>(level)), a, simd::set1<A>(value));
    };
}

void copy32f(const float* s, float* d, int n) {
    if (s != d) std::memmove(d, s, static_cast<size_t>(n) * sizeof(float));
}
void zero32f(float* d, int n) { std::memset(d, 0, static_cast<size_t>(n) * sizeof(float)); }

// ---- 16-bit integer kernels ---------------------------------------------------

// |x| with -32768 saturating to 32767: max(x, 0 -sat x).
constexpr auto kAbs16 = [](auto a) { return simd::max(a, simd::subSat(simd::zero<decltype(a)>(), a)); };

// Saturated sum with a constant in -32768 .. 32768 (a difference is a sum
// with -val, formed in 32 bits so that -(-32768) is exact; that one constant
// goes element by element).
template <class Run>
void addConst16(int32_t c, Run&& run) {
    if (c <= 32767)
        run([v = int16_t(c)](auto a) { return simd::addSat(a, simd::set1<decltype(a)>(v)); });
    else
        run([c](int16_t a) { return saturate<int16_t>(int32_t(a) + c); });
}

// Sum of two vectors scaled by 2^-sf with ties to even (see zorsAdd_16s_Sfs).
struct AddScaled16 {
    int sf;
    int16_t operator()(int16_t a, int16_t b) const {
        return saturate<int16_t>(scaleRound(int32_t(a) + int32_t(b), sf));
    }
    template <int B>
    simd::Vec<int16_t, B> operator()(simd::Vec<int16_t, B> a, simd::Vec<int16_t, B> b) const {
        using namespace simd;
        using V = Vec<int16_t, B>;
        using W = Vec<int32_t, B>;
        if (sf == 0) return addSat(a, b);
        if (sf > 16) return zero<V>();
        if (sf <= -16) {
            // Only the sign of the sum survives; the saturating sum keeps it.
            const V s = addSat(a, b), z = zero<V>();
            return (gt(s, z) & set1<V>(32767)) | (lt(s, z) & set1<V>(-32768));
        }
        W lo = widenLo(a) + widenLo(b), hi = widenHi(a) + widenHi(b);
        if (sf < 0) {
            lo = shl(lo, -sf);
            hi = shl(hi, -sf);
        } else {
            const W half = set1<W>((1 << (sf - 1)) - 1), one = set1<W>(1);
            lo = shr(lo + half + (shr(lo, sf) & one), sf);
            hi = shr(hi + half + (shr(hi, sf) & one), sf);
        }
        return narrowSat<int16_t>(lo, hi);
    }
};

// Product scaled by 2^-sf, rounded half up (toward +inf), saturated.  In
// registers for 0 <= sf <= 30, where p + 2^(sf-1) stays inside 32 bits.
struct MulRounded16 {
    int sf;
    bool fitsRegisters() const { return sf <= 30; }
    int16_t operator()(int16_t a, int16_t b) const {
        return saturate<int16_t>(scaleRoundHalfUp(int32_t(a) * int32_t(b), sf));
    }
    template <int B>
    simd::Vec<int16_t, B> operator()(simd::Vec<int16_t, B> a, simd::Vec<int16_t, B> b) const {
        using namespace simd;
        using W = Vec<int32_t, B>;
        const auto low = a * b, high = mulHi(a, b);
        // With sf 0 both the half and the shift are 0.
        const W half = set1<W>(sf > 0 ? 1 << (sf - 1) : 0);
        const W lo = shr(bitcast<int32_t>(zipLo(low, high)) + half, sf);
        const W hi = shr(bitcast<int32_t>(zipHi(low, high)) + half, sf);
        return narrowSat<int16_t>(lo, hi);
    }
};

// MulRounded16 on registers where it can, element by element otherwise.
[[maybe_unused]] void mulRounded16(const int16_t* a, const int16_t* b, int16_t* d, int n, MulRounded16 op) {
    if (op.fitsRegisters())
        simd::mapLanes(a, b, d, n, op);
    else
        simd::mapLanes(a, b, d, n, [op](int16_t x, int16_t y) { return op(x, y); });
}
[[maybe_unused]] void mulRounded16(const int16_t* s, int16_t c, int16_t* d, int n, MulRounded16 op) {
    const auto withC = [op, c](auto a) { return op(a, simd::set1<decltype(a)>(c)); };
    if (op.fitsRegisters())
        simd::mapLanes(s, d, n, withC);
    else
        simd::mapLanes(s, d, n, [withC](int16_t x) { return withC(x); });
}

[[maybe_unused]] bool misaligned16(const void* p) { return (reinterpret_cast<uintptr_t>(p) & 15) != 0; }

// The plain elementwise exports: pointers and length checked, then op over
// every element.
template <class S, class D, class Op>
Status checkedMap(const S* s, D* d, int len, Op op) {
    if (Status st = checkFirst(anyNull(s, d), badLength(len))) return st;
    simd::mapLanes(s, d, len, op);
    return StatusOk;
}
template <class S, class D, class Op>
Status checkedMap(const S* a, const S* b, D* d, int len, Op op) {
    if (Status st = checkFirst(anyNull(a, b, d), badLength(len))) return st;
    simd::mapLanes(a, b, d, len, op);
    return StatusOk;
}

}  // namespace

// ---- exports ---------------------------------------------------------------------------

Status ZOR_CALL zorsAdd_32f(const float* pSrc1, const float* pSrc2, float* pDst, int len) {
    return checkedMap(pSrc1, pSrc2, pDst, len, kAdd);
}
Status ZOR_CALL zorsAdd_32f_I(const float* pSrc, float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrc, pSrcDst, len, kAdd);
}
Status ZOR_CALL zorsSub_32f_I(const float* pSrc, float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrc, pSrcDst, len, kSub);
}
Status ZOR_CALL zorsMul_32f_I(const float* pSrc, float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrc, pSrcDst, len, kMul);
}
// No check for zero divisors: IEEE infinities and NaNs result.
Status ZOR_CALL zorsDiv_32f_I(const float* pSrc, float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrc, pSrcDst, len, kDiv);
}

// The constant shortcuts (add 0, multiply by 1 or 0, subtract 0) skip the
// arithmetic altogether: NaN payloads and -0.0 survive a copy, and an
// infinite or NaN element times 0 becomes 0.
Status ZOR_CALL zorsAddC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0.0f) return StatusOk;
    simd::mapLanes(pSrcDst, pSrcDst, len, addConst(val));
    return StatusOk;
}
Status ZOR_CALL zorsSubC_32f(const float* pSrc, float val, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (val == 0.0f)
        copy32f(pSrc, pDst, len);
    else
        simd::mapLanes(pSrc, pDst, len, subConst(val));
    return StatusOk;
}
Status ZOR_CALL zorsSubC_32f_I(float val, float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrcDst, len, subConst(val));
}
Status ZOR_CALL zorsMulC_32f(const float* pSrc, float val, float* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (val == 1.0f)
        copy32f(pSrc, pDst, len);
    else if (val == 0.0f)
        zero32f(pDst, len);
    else
        simd::mapLanes(pSrc, pDst, len, mulConst(val));
    return StatusOk;
}
Status ZOR_CALL zorsMulC_32f_I(float val, float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 1.0f) return StatusOk;
    if (val == 0.0f)
        zero32f(pSrcDst, len);
    else
        simd::mapLanes(pSrcDst, pSrcDst, len, mulConst(val));
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

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zorsAdd_16s_Sfs(const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len,
                                int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDst), badLength(len))) return s;
    if (scaleFactor > 16) {  // every scaled sum rounds to 0
        std::memset(pDst, 0, static_cast<size_t>(len) * sizeof(int16_t));
        return StatusOk;
    }
    simd::mapLanes(pSrc1, pSrc2, pDst, len, AddScaled16{scaleFactor});
    return StatusOk;
}
Status ZOR_CALL zorsAddC_16s_I(int16_t val, int16_t* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0) return StatusOk;
    addConst16(val, [&](auto op) { simd::mapLanes(pSrcDst, pSrcDst, len, op); });
    return StatusOk;
}
Status ZOR_CALL zorsSubC_16s_I(int16_t val, int16_t* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (val == 0) return StatusOk;
    addConst16(-int32_t(val), [&](auto op) { simd::mapLanes(pSrcDst, pSrcDst, len, op); });
    return StatusOk;
}

// The _NR multiplies refuse negative scale factors after the pointer and
// length checks.
Status ZOR_CALL zorsMul_NR_16s_Sfs(const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len,
                                   int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    mulRounded16(pSrc1, pSrc2, pDst, len, MulRounded16{scaleFactor});
    return StatusOk;
}
Status ZOR_CALL zorsMul_NR_16s_ISfs(const int16_t* pSrc, int16_t* pSrcDst, int len, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pSrcDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    mulRounded16(pSrc, pSrcDst, pSrcDst, len, MulRounded16{scaleFactor});
    return StatusOk;
}
Status ZOR_CALL zorsMulC_NR_16s_Sfs(const int16_t* pSrc, int16_t val, int16_t* pDst, int len,
                                    int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    mulRounded16(pSrc, val, pDst, len, MulRounded16{scaleFactor});
    return StatusOk;
}
Status ZOR_CALL zorsMulC_NR_16s_ISfs(int16_t val, int16_t* pSrcDst, int len, int scaleFactor) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (scaleFactor < 0) return StatusBadScaleFactor;
    mulRounded16(pSrcDst, val, pSrcDst, len, MulRounded16{scaleFactor});
    return StatusOk;
}

Status ZOR_CALL zorsAbs_16s(const int16_t* pSrc, int16_t* pDst, int len) {
    return checkedMap(pSrc, pDst, len, kAbs16);
}
Status ZOR_CALL zorsAbs_16s_I(int16_t* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrcDst, len, kAbs16);
}
Status ZOR_CALL zorsAbs_64f(const double* pSrc, double* pDst, int len) {
    return checkedMap(pSrc, pDst, len, kAbs);
}
Status ZOR_CALL zorsAbs_64f_I(double* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrcDst, len, kAbs);
}
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

Status ZOR_CALL zorsAbs_32f(const float* pSrc, float* pDst, int len) {
    return checkedMap(pSrc, pDst, len, kAbs);
}
Status ZOR_CALL zorsAbs_32f_I(float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrcDst, len, kAbs);
}
Status ZOR_CALL zorsSqr_32f(const float* pSrc, float* pDst, int len) {
    return checkedMap(pSrc, pDst, len, kSquare);
}
Status ZOR_CALL zorsSqr_32f_I(float* pSrcDst, int len) {
    return checkedMap(pSrcDst, pSrcDst, len, kSquare);
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
        simd::mapLanes(pSrcDst, pSrcDst, len, clipAbove(level));
    else
        simd::mapLanes(pSrcDst, pSrcDst, len, clipBelow(level));
    return StatusOk;
}
Status ZOR_CALL zorsThreshold_LTVal_32f(const float* pSrc, float* pDst, int len, float level, float value) {
    return checkedMap(pSrc, pDst, len, belowToValue(level, value));
}
Status ZOR_CALL zorsThreshold_LTVal_32f_I(float* pSrcDst, int len, float level, float value) {
    return checkedMap(pSrcDst, pSrcDst, len, belowToValue(level, value));
}

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
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
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

#if ZOR_DEFINES_ENTRIES_OF(ZOR_ALL)
// Sorting is the same comparison sequence on every processor; each variant
// has its own entry so that the 32-bit build compares in the SSE unit
// rather than on the x87 stack.
Status ZOR_CALL zorsSortDescend_32f_I(float* pSrcDst, int len) {
    if (Status s = checkFirst(anyNull(pSrcDst), badLength(len))) return s;
    if (len > 1) sortDescend(pSrcDst, len);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
