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
#include "frame/mxcsr.h"
#include "frame/simd.h"
#include "image/pixel/pixel_rows.h"

#include <algorithm>

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

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
// Registers at the column's width (16 bytes up to SSSE3, 32 or 64 in the
// wide columns), widened and narrowed in the lane order of the whole
// register, so that every width gives the elements in order.
using U8 = simd::Vec<uint8_t>;
using U16 = simd::Vec<uint16_t>;
using F = simd::Vec<float>;
using I = simd::Vec<int32_t>;

ptrdiff_t widen8u16uSimd(const uint8_t* s, uint16_t* d, ptrdiff_t n) {
    using namespace simd;
    return eachBlock<U8::kLanes>(n, [&](ptrdiff_t x) {
        const U8 v = load<U8>(s + x);
        store(d + x, widenLoInOrder(v));
        store(d + x + U16::kLanes, widenHiInOrder(v));
    });
}

// A register of bytes to floats: each byte zero-extended to 16 and then 32
// bits (unpacks with zero at 16 bytes, as fast in the benchmark as one byte
// shuffle per four values) and converted, exactly.  With Stream the floats
// go out with non-temporal stores (d 16-byte aligned).
template <bool Stream = false>
inline void bytesToFloats(const uint8_t* s, float* d) {
    using namespace simd;
    const U8 v = load<U8>(s);
    const U16 halves[2] = {widenLoInOrder(v), widenHiInOrder(v)};
    for (int h = 0; h < 2; ++h) {
        const F q[2] = {toFloat(bitcast<int32_t>(widenLoInOrder(halves[h]))),
                        toFloat(bitcast<int32_t>(widenHiInOrder(halves[h])))};
        for (int k = 0; k < 2; ++k) {
            float* out = d + (2 * h + k) * F::kLanes;
            if constexpr (Stream) stream(out, q[k]);
            else store(out, q[k]);
        }
    }
}

template <bool Stream = false>
ptrdiff_t u8ToFloatSimd(const uint8_t* s, float* d, ptrdiff_t n) {
    return eachBlock<U8::kLanes>(n, [&](ptrdiff_t x) { bytesToFloats<Stream>(s + x, d + x); });
}

ptrdiff_t s16ToFloatSimd(const int16_t* s, float* d, ptrdiff_t n) {
    using namespace simd;
    using V = Vec<int16_t>;
    return eachBlock<V::kLanes>(n, [&](ptrdiff_t x) {
        const V v = load<V>(s + x);
        store(d + x, toFloat(widenLoInOrder(v)));
        store(d + x + F::kLanes, toFloat(widenHiInOrder(v)));
    });
}

// Float to 8 bits, a register of bytes at a time: the upper clamp in float,
// then cvtps2dq (or cvttps2dq) and saturating packs.  Negative values end
// as 0; min returns its second operand when one is NaN, so NaN stays NaN,
// becomes INT_MIN and ends as 0; 255 and above (up to infinity) end as 255.
//
// With Aligned the loads fold into the conversions (legacy SSE takes only
// aligned memory operands), which leaves more room in the out-of-order
// window for loads in flight.
template <bool Nearest, bool Aligned>
inline I floatToInt(const float* s) {
    using namespace simd;
    F v = Aligned ? loadAligned<F>(s) : load<F>(s);
    v = min(set1<F>(255.0f), v);
    return Nearest ? toInt32(v) : toInt32Trunc(v);
}
template <bool Nearest, bool Aligned>
inline simd::Vec<int16_t> floatToI16(const float* s) {
    return simd::narrowSatInOrder<int16_t>(floatToInt<Nearest, Aligned>(s),
                                           floatToInt<Nearest, Aligned>(s + F::kLanes));
}

template <bool Nearest, bool Aligned>
ptrdiff_t floatToU8Simd(const float* s, uint8_t* d, ptrdiff_t n) {
    return eachBlock<U8::kLanes>(n, [&](ptrdiff_t x) {
        simd::store(d + x, simd::narrowSatInOrder<uint8_t>(floatToI16<Nearest, Aligned>(s + x),
                                                           floatToI16<Nearest, Aligned>(s + x + U16::kLanes)));
    });
}

// The blocks of a row, clamped on the way (see narrowFloats in the vector
// initialisers: no status flag decides anything).  With the invalid
// exception unmasked, where a SIMD conversion of a NaN would trap, the row
// goes element by element.
template <bool Nearest, bool Aligned>
ptrdiff_t floatToU8Blocks(const float* s, uint8_t* d, ptrdiff_t n, const ConversionScope& csr) {
    if (!csr.armed()) return 0;
    return floatToU8Simd<Nearest, Aligned>(s, d, n);
}

// Multiplies three registers of words by a repeating pattern of factors
// (period 3: three registers hold a whole number of periods), or one
// register by one factor.
ptrdiff_t shiftSimd(uint16_t* p, ptrdiff_t n, const U16 (&f)[3], int period) {
    using namespace simd;
    constexpr ptrdiff_t L = U16::kLanes;
    ptrdiff_t x = 0;
    const ptrdiff_t block = period == 3 ? 3 * L : L;
    for (; x + block <= n; x += block) {
        store(p + x, load<U16>(p + x) * f[0]);
        if (period == 3) {
            store(p + x + L, load<U16>(p + x + L) * f[1]);
            store(p + x + 2 * L, load<U16>(p + x + 2 * L) * f[2]);
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

#if ZOR_SIMD >= 2
// Bytes to floats with non-temporal stores from the first 16-byte aligned
// float on (the caller fences after the last row).
void toFloatRowStreamed(const uint8_t* s, float* d, ptrdiff_t n) {
    ptrdiff_t x = 0;
    const uintptr_t a = reinterpret_cast<uintptr_t>(d);
    if ((a & 3) == 0) {
        const ptrdiff_t head = std::min<ptrdiff_t>(n, static_cast<ptrdiff_t>((16 - (a & 15)) & 15) / 4);
        for (; x < head; ++x) d[x] = static_cast<float>(s[x]);
        x += u8ToFloatSimd<true>(s + x, d + x, n - x);
    }
    toFloatRow(s + x, d + x, n - x);
}
#endif

#if ZOR_SIMD >= 2
using RowScope = ConversionScope;
#else
struct RowScope {};  // the generic rule needs no state
#endif

// The blocks start where the source is 16-byte aligned (when it is at least
// float aligned).  The elements before and after them go one by one, after
// the blocks.
template <bool Nearest>
void toU8Row(const float* s, uint8_t* d, ptrdiff_t n, [[maybe_unused]] RowScope& csr) {
    ptrdiff_t head = 0, end = 0;
#if ZOR_SIMD >= 2
    const uintptr_t a = reinterpret_cast<uintptr_t>(s);
    head = static_cast<ptrdiff_t>((16 - (a & 15)) & 15) / 4;
    if ((a & 3) == 0 && n >= head + 16) {
        end = head + floatToU8Blocks<Nearest, true>(s + head, d + head, n - head, csr);
    } else {
        head = 0;
        end = floatToU8Blocks<Nearest, false>(s, d, n, csr);
    }
#endif
    for (ptrdiff_t x = 0; x < head; ++x) d[x] = floatToU8(s[x], Nearest);
    for (ptrdiff_t x = end; x < n; ++x) d[x] = floatToU8(s[x], Nearest);
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
    U16 fv[3];
    {
        alignas(64) uint16_t t[3 * U16::kLanes];
        for (int i = 0; i < 3 * U16::kLanes; ++i) t[i] = C == 1 ? f[0] : f[i % period];
        simd::loadBlock(t, fv);
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
#if ZOR_SIMD >= 2
    if (streamsOutput(roiSize, sizeof(float))) {
        const Status s = convert<uint8_t, float, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toFloatRowStreamed);
        simd::streamFence();
        return s;
    }
#endif
    return convert<uint8_t, float, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toFloatRow<uint8_t>);
}
Status ZOR_CALL zoriConvert_16s32f_C1R(const int16_t* pSrc, int srcStep, float* pDst, int dstStep,
                                       ImageSize roiSize) {
    return convert<int16_t, float, 1>(pSrc, srcStep, pDst, dstStep, roiSize, toFloatRow<int16_t>);
}
Status ZOR_CALL zoriConvert_32f8u_C1R(const float* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                      ImageSize roiSize, int roundMode) {
    RowScope csr;
    // mode 1 rounds to nearest with ties to even; any other value truncates
    if (roundMode == 1)
        return convert<float, uint8_t, 1>(pSrc, srcStep, pDst, dstStep, roiSize,
                                          [&](const float* s, uint8_t* d, ptrdiff_t n) { toU8Row<true>(s, d, n, csr); });
    return convert<float, uint8_t, 1>(pSrc, srcStep, pDst, dstStep, roiSize,
                                      [&](const float* s, uint8_t* d, ptrdiff_t n) { toU8Row<false>(s, d, n, csr); });
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

#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
