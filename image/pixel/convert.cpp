// Pixel type conversions (widening, integer to float, float to 8-bit with a
// rounding mode) and in-place left shifts of 16-bit images.
//
// Conversions check pointers, sizes, then steps; the shifts check the step
// before the size.  Rows whose steps equal their length are converted as
// one long row.  Integer-to-float results are exact and the float-to-8-bit
// rule is exact too, so the SSE variant gains nothing and shares the
// generic entries.
#include "frame/variant.h"
#include "frame/status.h"
#include "image/pixel/rows.h"

#if ZOR_VARIANT != 1

namespace zor { namespace ZOR_NS {
namespace {

// ---- generic element rules ---------------------------------------------------------

// Float to 8 bits: saturate (NaN to 0), then ties to even or truncation.
// v + 0.5 is exact in double for every float below 255.
inline uint8_t floatToU8(float v, bool nearest) {
    if (v >= 255.0f) return 255;
    if (!(v > 0.0f)) return 0;
    const double d = nearest ? static_cast<double>(v) + 0.5 : static_cast<double>(v);
    int t = static_cast<int>(d);
    if (nearest && (t & 1) && static_cast<double>(t) == d) --t;
    return static_cast<uint8_t>(t);
}

// x << s keeping 16 bits, as a multiplication so that one rule serves every
// count: s above 15 multiplies by 0.
inline uint16_t shiftFactor(uint32_t s) { return s > 15 ? 0 : static_cast<uint16_t>(1u << s); }

// ---- SIMD ------------------------------------------------------------------------

#if ZOR_SIMD >= 2
// Forces round-to-nearest for cvtps2dq while a conversion runs, whatever the
// caller left in MXCSR.
class NearestRounding {
public:
    NearestRounding() : saved_(_mm_getcsr()) {
        if (saved_ & 0x6000u) _mm_setcsr(saved_ & ~0x6000u);
    }
    ~NearestRounding() {
        if (saved_ & 0x6000u) _mm_setcsr(saved_);
    }
    NearestRounding(const NearestRounding&) = delete;
    NearestRounding& operator=(const NearestRounding&) = delete;

private:
    unsigned saved_;
};

ptrdiff_t widen8u16uSimd(const uint8_t* s, uint16_t* d, ptrdiff_t n) {
    const __m128i z = _mm_setzero_si128();
    ptrdiff_t x = 0;
    for (; x + 16 <= n; x += 16) {
        const __m128i v = load16(s + x);
        store16(d + x, _mm_unpacklo_epi8(v, z));
        store16(d + x + 8, _mm_unpackhi_epi8(v, z));
    }
    return x;
}

ptrdiff_t u8ToFloatSimd(const uint8_t* s, float* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 4
    // one shuffle per four values: byte k of the load into the low byte of a
    // zeroed 32-bit lane
    const __m128i m0 = _mm_setr_epi8(0, -1, -1, -1, 1, -1, -1, -1, 2, -1, -1, -1, 3, -1, -1, -1);
    const __m128i m1 = _mm_setr_epi8(4, -1, -1, -1, 5, -1, -1, -1, 6, -1, -1, -1, 7, -1, -1, -1);
    const __m128i m2 = _mm_setr_epi8(8, -1, -1, -1, 9, -1, -1, -1, 10, -1, -1, -1, 11, -1, -1, -1);
    const __m128i m3 = _mm_setr_epi8(12, -1, -1, -1, 13, -1, -1, -1, 14, -1, -1, -1, 15, -1, -1, -1);
    for (; x + 16 <= n; x += 16) {
        const __m128i v = load16(s + x);
        _mm_storeu_ps(d + x, _mm_cvtepi32_ps(_mm_shuffle_epi8(v, m0)));
        _mm_storeu_ps(d + x + 4, _mm_cvtepi32_ps(_mm_shuffle_epi8(v, m1)));
        _mm_storeu_ps(d + x + 8, _mm_cvtepi32_ps(_mm_shuffle_epi8(v, m2)));
        _mm_storeu_ps(d + x + 12, _mm_cvtepi32_ps(_mm_shuffle_epi8(v, m3)));
    }
#endif
    const __m128i z = _mm_setzero_si128();
    for (; x + 16 <= n; x += 16) {
        const __m128i v = load16(s + x);
        const __m128i lo = _mm_unpacklo_epi8(v, z), hi = _mm_unpackhi_epi8(v, z);
        _mm_storeu_ps(d + x, _mm_cvtepi32_ps(_mm_unpacklo_epi16(lo, z)));
        _mm_storeu_ps(d + x + 4, _mm_cvtepi32_ps(_mm_unpackhi_epi16(lo, z)));
        _mm_storeu_ps(d + x + 8, _mm_cvtepi32_ps(_mm_unpacklo_epi16(hi, z)));
        _mm_storeu_ps(d + x + 12, _mm_cvtepi32_ps(_mm_unpackhi_epi16(hi, z)));
    }
    return x;
}

ptrdiff_t s16ToFloatSimd(const int16_t* s, float* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
    for (; x + 8 <= n; x += 8) {
        const __m128i v = load16(s + x);
        // the word in the upper half, then an arithmetic shift: sign extension
        _mm_storeu_ps(d + x, _mm_cvtepi32_ps(_mm_srai_epi32(_mm_unpacklo_epi16(v, v), 16)));
        _mm_storeu_ps(d + x + 4, _mm_cvtepi32_ps(_mm_srai_epi32(_mm_unpackhi_epi16(v, v), 16)));
    }
    return x;
}

// Only the upper clamp is done in float: min returns its second operand
// when one is NaN, so NaN (and -inf) stay and convert to the integer
// indefinite value, INT_MIN, which the packs below saturate to 0 together
// with every negative value; 255 and above end as 255.
template <bool Nearest>
inline __m128i floatToInt(__m128 v) {
    v = _mm_min_ps(_mm_set1_ps(255.0f), v);
    return Nearest ? _mm_cvtps_epi32(v) : _mm_cvttps_epi32(v);
}

template <bool Nearest>
ptrdiff_t floatToU8Simd(const float* s, uint8_t* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
    for (; x + 16 <= n; x += 16) {
        const __m128i a = floatToInt<Nearest>(_mm_loadu_ps(s + x));
        const __m128i b = floatToInt<Nearest>(_mm_loadu_ps(s + x + 4));
        const __m128i c = floatToInt<Nearest>(_mm_loadu_ps(s + x + 8));
        const __m128i e = floatToInt<Nearest>(_mm_loadu_ps(s + x + 12));
        store16(d + x, _mm_packus_epi16(_mm_packs_epi32(a, b), _mm_packs_epi32(c, e)));
    }
    return x;
}

// Multiplies 24 words (three registers) by a repeating pattern of factors.
ptrdiff_t shiftSimd(uint16_t* p, ptrdiff_t n, const __m128i (&f)[3], int period) {
    ptrdiff_t x = 0;
    const ptrdiff_t block = period == 3 ? 24 : 8;
    for (; x + block <= n; x += block) {
        store16(p + x, _mm_mullo_epi16(load16(p + x), f[0]));
        if (period == 3) {
            store16(p + x + 8, _mm_mullo_epi16(load16(p + x + 8), f[1]));
            store16(p + x + 16, _mm_mullo_epi16(load16(p + x + 16), f[2]));
        }
    }
    return x;
}
#endif

// ---- the forms ---------------------------------------------------------------------

template <class S, class D, int C, class Row>
Status convert(const S* pSrc, int srcStep, D* pDst, int dstStep, ImageSize roi, Row row) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi), badSteps(srcStep, dstStep))) return s;
    const bool contiguous = packed(srcStep, roi, C * sizeof(S)) && packed(dstStep, roi, C * sizeof(D));
    const Rows r = rowsOf(roi, C, contiguous);
    for (int y = 0; y < r.count; ++y) row(rowAt(pSrc, srcStep, y), rowAt(pDst, dstStep, y), r.elems);
    return StatusOk;
}

void widenRow(const uint8_t* s, uint16_t* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    x = widen8u16uSimd(s, d, n);
#endif
    for (; x < n; ++x) d[x] = s[x];
}

template <class S>
void toFloatRow(const S* s, float* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    if constexpr (sizeof(S) == 1) x = u8ToFloatSimd(s, d, n);
    else x = s16ToFloatSimd(s, d, n);
#endif
    for (; x < n; ++x) d[x] = static_cast<float>(s[x]);  // exact: |s| < 2^24
}

template <bool Nearest>
void toU8Row(const float* s, uint8_t* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    x = floatToU8Simd<Nearest>(s, d, n);
#endif
    for (; x < n; ++x) d[x] = floatToU8(s[x], Nearest);
}

// In-place shift of a C-element image (C = 1, 3 or 4; for 4 the last
// element is alpha and keeps factor 1, so it is rewritten unchanged).
template <int C>
Status shift(const uint32_t* counts, uint16_t* p, int step, ImageSize roi) {
    if (Status s = checkFirst(anyNull(counts, p), badSteps(step), badRoi(roi))) return s;
    const uint32_t c0 = counts[0], c1 = C == 1 ? c0 : counts[1], c2 = C == 1 ? c0 : counts[2];
    if (c0 == 0 && c1 == 0 && c2 == 0) return StatusOk;  // every value stays
    const uint16_t f[4] = {shiftFactor(c0), shiftFactor(c1), shiftFactor(c2), 1};
    constexpr int period = C == 1 ? 1 : C;
    const Rows r = rowsOf(roi, C, packed(step, roi, C * sizeof(uint16_t)));
#if ZOR_SIMD >= 2
    __m128i fv[3];
    {
        alignas(16) uint16_t t[24];
        for (int i = 0; i < 24; ++i) t[i] = C == 1 ? f[0] : f[i % period];
        for (int k = 0; k < 3; ++k) fv[k] = _mm_load_si128(reinterpret_cast<const __m128i*>(t) + k);
    }
#endif
    for (int y = 0; y < r.count; ++y) {
        uint16_t* row = rowAt(p, step, y);
        ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
        x = shiftSimd(row, r.elems, fv, period == 3 ? 3 : 1);
#endif
        for (; x < r.elems; ++x) row[x] = static_cast<uint16_t>(uint32_t(row[x]) * f[C == 1 ? 0 : x % period]);
    }
    return StatusOk;
}

}  // namespace

// ---- exports -------------------------------------------------------------------------

Status ZOR_CALL zoriConvert_8u16u_C1R(const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                      ImageSize roiSize) {
    return convert<uint8_t, uint16_t, 1>(pSrc, srcStep, pDst, dstStep, roiSize, widenRow);
}
Status ZOR_CALL zoriConvert_8u16u_C3R(const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                      ImageSize roiSize) {
    return convert<uint8_t, uint16_t, 3>(pSrc, srcStep, pDst, dstStep, roiSize, widenRow);
}
Status ZOR_CALL zoriConvert_8u16u_C4R(const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                      ImageSize roiSize) {
    return convert<uint8_t, uint16_t, 4>(pSrc, srcStep, pDst, dstStep, roiSize, widenRow);
}
Status ZOR_CALL zoriConvert_8u32f_C1R(const uint8_t* pSrc, int srcStep, float* pDst, int dstStep,
                                      ImageSize roiSize) {
    return convert<uint8_t, float, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toFloatRow<uint8_t>);
}
Status ZOR_CALL zoriConvert_16s32f_C1R(const int16_t* pSrc, int srcStep, float* pDst, int dstStep,
                                       ImageSize roiSize) {
    return convert<int16_t, float, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toFloatRow<int16_t>);
}
Status ZOR_CALL zoriConvert_32f8u_C1R(const float* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                      ImageSize roiSize, int roundMode) {
#if ZOR_SIMD >= 2
    NearestRounding nearest;
#endif
    // mode 1 rounds to nearest with ties to even; any other value truncates
    return roundMode == 1 ? convert<float, uint8_t, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toU8Row<true>)
                          : convert<float, uint8_t, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toU8Row<false>);
}

Status ZOR_CALL zoriLShiftC_16u_C1IR(uint32_t value, uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize) {
    return shift<1>(&value, pSrcDst, srcDstStep, roiSize);
}
Status ZOR_CALL zoriLShiftC_16u_C3IR(const uint32_t* value, uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize) {
    return shift<3>(value, pSrcDst, srcDstStep, roiSize);
}
Status ZOR_CALL zoriLShiftC_16u_AC4IR(const uint32_t* value, uint16_t* pSrcDst, int srcDstStep,
                                      ImageSize roiSize) {
    return shift<4>(value, pSrcDst, srcDstStep, roiSize);
}

}}  // namespace zor::ZOR_NS

#endif  // ZOR_VARIANT != 1
