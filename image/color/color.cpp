// Colour model conversions: RGB and YCbCr (full resolution, 4:2:2 packed,
// 4:2:0 planar), HSV, HLS, 16-bit Photo-YCC and weighted grey.
//
// Every conversion checks its pointers and the ROI size (steps are used as
// given), then converts row by row.  Results depend only on the pixel, pixel
// pair or 2 x 2 block being converted.  The fixed-point forms are integer
// formulas (color_pixels.h) that the SIMD rows reproduce bit for bit
// (color_kernels.h).  The floating-point forms compute in double precision;
// RGB to HSV has SIMD rows in integer arithmetic that give the same bytes
// (see hsvRowSimd), the others share the generic entry.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/row_address.h"
#include "frame/status.h"
#include "image/color/color_kernels.h"
#include "image/color/color_pixels.h"

#include <cmath>

// Every entry is generic or integer work: the SSE variant has none of its own.
#if ZOR_VARIANT != 1

namespace zor { namespace ZOR_NS {
namespace {

using namespace color;

// Checks, then row(source row, destination row, width) for every row.
template <class S, class D, class Row>
Status eachRow(const S* pSrc, int srcStep, D* pDst, int dstStep, ImageSize roi, Row&& row) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi))) return s;
    for (int y = 0; y < roi.height; ++y) row(rowAt(pSrc, srcStep, y), rowAt(pDst, dstStep, y), roi.width);
    return StatusOk;
}

// Pixels from x on, one at a time: the generic rows and the SIMD tails.
template <int SC, int DC, class S, class D, class Px>
void pixelsFrom(int x, const S* s, D* d, int n, Px&& px) {
    for (s += SC * x, d += DC * x; x < n; ++x, s += SC, d += DC) px(s, d);
}

// ---- weighted grey --------------------------------------------------------------------

// A float weight as its 12-bit fixed-point integer, taken modulo 2^32.
uint32_t grayWeight(float w) {
    const double t = std::trunc(static_cast<double>(w) * 4096.0 + 0.5);
    if (!(t < 9223372036854775808.0 && t > -9223372036854775808.0)) return 0;
    return static_cast<uint32_t>(static_cast<uint64_t>(static_cast<int64_t>(t)));
}

template <int SC>
Status grayRows(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roi, const float* coeffs) {
    uint32_t w[3] = {1225, 2404, 467};
    if (coeffs != nullptr)
        for (int k = 0; k < 3; ++k) w[k] = grayWeight(coeffs[k]);
    return eachRow(pSrc, srcStep, pDst, dstStep, roi, [&](const uint8_t* s, uint8_t* d, int n) {
        const int x = grayRowSimd<SC>(s, d, n, w);
        pixelsFrom<SC, 1>(x, s, d, n, [&](const uint8_t* p, uint8_t* q) { *q = weightedGray(p[0], p[1], p[2], w); });
    });
}

// The truncated double sum modulo 2^16; NaN and magnitudes from 2^63 on give 0.
template <int SC>
Status gray16Rows(const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roi,
                  const float* coeffs) {
    const float defaults[3] = {0.299f, 0.587f, 0.114f};
    const float* c = coeffs != nullptr ? coeffs : defaults;
    const double c0 = c[0], c1 = c[1], c2 = c[2];
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roi, [&](const uint16_t* s, uint16_t* d, int n) {
        pixelsFrom<SC, 1>(0, s, d, n, [&](const uint16_t* p, uint16_t* q) {
            const double t = std::trunc(toDouble(c0 * p[0] + c1 * p[1] + c2 * p[2]));
            const bool inRange = t < 9223372036854775808.0 && t > -9223372036854775808.0;
            *q = inRange ? static_cast<uint16_t>(static_cast<uint64_t>(static_cast<int64_t>(t))) : 0;
        });
    });
}

// ---- 4:2:2 packed rows -------------------------------------------------------------------

void toPacked422Row(const uint8_t* s, uint8_t* d, int n) {
    int x = packed422RowSimd(s, d, n);
    for (s += 3 * x, d += 2 * x; x + 1 < n; x += 2, s += 6, d += 4) {
        d[0] = lumaOf(s[0], s[1], s[2]);
        d[2] = lumaOf(s[3], s[4], s[5], 1048576);  // no rounding half: kept as specified
        const int rs = s[0] + s[3], gs = s[1] + s[4], bs = s[2] + s[5];
        d[1] = ChromaOf<2>::cb(rs, gs, bs);
        d[3] = ChromaOf<2>::cr(rs, gs, bs);
    }
    if (x < n) {  // odd width: the last pixel's luma and blue chroma only
        d[0] = lumaOf(s[0], s[1], s[2]);
        d[1] = ChromaOf<1>::cb(s[0], s[1], s[2]);
    }
}

void fromPacked422Row(const uint8_t* s, uint8_t* d, int n) {
    if (n == 1) {  // one byte pair Y, V: V serves as both chroma
        rgbOf(s[0], s[1], s[1], kPackedTerms, d, d + 1, d + 2);
        return;
    }
    int x = unpack422RowSimd(s, d, n);
    for (s += 2 * x, d += 3 * x; x + 1 < n; x += 2, s += 4, d += 6) {
        rgbOf(s[0], s[1], s[3], kPackedTerms, d, d + 1, d + 2);
        rgbOf(s[2], s[1], s[3], kPackedTerms, d + 3, d + 4, d + 5);
    }
    if (x < n) rgbOf(s[0], s[1], s[-1], kPackedTerms, d, d + 1, d + 2);  // Cr of the pair before
}

// ---- 4:2:0 planar ------------------------------------------------------------------------

Status toPlanar420(const uint8_t* pSrc, int srcStep, uint8_t* const* pDst, const int* dstStep, ImageSize roi) {
    if (pSrc == nullptr || pDst == nullptr || pDst[0] == nullptr || pDst[1] == nullptr || pDst[2] == nullptr ||
        dstStep == nullptr)
        return StatusNullPointer;
    if (roi.width < 2 || roi.height < 2) return StatusBadSize;
    const int blocks = roi.width / 2;
    for (int y = 0; y + 1 < roi.height; y += 2) {
        const uint8_t* s0 = rowAt(pSrc, srcStep, y);
        const uint8_t* s1 = rowAt(pSrc, srcStep, y + 1);
        uint8_t* y0 = rowAt(pDst[0], dstStep[0], y);
        uint8_t* y1 = rowAt(pDst[0], dstStep[0], y + 1);
        uint8_t* cb = rowAt(pDst[1], dstStep[1], y / 2);
        uint8_t* cr = rowAt(pDst[2], dstStep[2], y / 2);
        for (int j = planar420RowsSimd(s0, s1, y0, y1, cb, cr, blocks); j < blocks; ++j) {
            const uint8_t* a = s0 + 6 * j;
            const uint8_t* b = s1 + 6 * j;
            y0[2 * j] = lumaOf(a[2], a[1], a[0]);
            y0[2 * j + 1] = lumaOf(a[5], a[4], a[3]);
            y1[2 * j] = lumaOf(b[2], b[1], b[0]);
            y1[2 * j + 1] = lumaOf(b[5], b[4], b[3]);
            const int bs = a[0] + a[3] + b[0] + b[3], gs = a[1] + a[4] + b[1] + b[4], rs = a[2] + a[5] + b[2] + b[5];
            cb[j] = ChromaOf<4>::cb(rs, gs, bs);
            cr[j] = ChromaOf<4>::cr(rs, gs, bs);
        }
    }
    return (roi.width | roi.height) & 1 ? StatusWarnOddSize : StatusOk;
}

Status fromPlanar420(const uint8_t* const* pSrc, const int* srcStep, uint8_t* pDst, int dstStep, ImageSize roi) {
    if (pSrc == nullptr || srcStep == nullptr || pDst == nullptr) return StatusNullPointer;
    if (Status s = badRoi(roi)) return s;
    if (pSrc[0] == nullptr || pSrc[1] == nullptr || pSrc[2] == nullptr) return StatusNullPointer;
    const int blocks = roi.width / 2;
    for (int y = 0; y + 1 < roi.height; y += 2) {
        const uint8_t* cb = rowAt(pSrc[1], srcStep[1], y / 2);
        const uint8_t* cr = rowAt(pSrc[2], srcStep[2], y / 2);
        for (int k = 0; k < 2; ++k) {
            const uint8_t* luma = rowAt(pSrc[0], srcStep[0], y + k);
            uint8_t* d = rowAt(pDst, dstStep, y + k);
            for (int j = unplanar420RowSimd(luma, cb, cr, d, blocks); j < blocks; ++j)
                for (int i = 0; i < 2; ++i) {
                    uint8_t* p = d + 6 * j + 3 * i;
                    rgbOf(luma[2 * j + i], cb[j] - 128, cr[j] - 128, kHalfTerms, p + 2, p + 1, p);
                }
        }
    }
    return (roi.width | roi.height) & 1 ? StatusWarnOddSize : StatusOk;
}

}  // namespace

// ---- exports ---------------------------------------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

Status ZOR_CALL zoriRGBToYCbCr_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                      ImageSize roiSize) {
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(ycbcrRowSimd(s, d, n), s, d, n, [](const uint8_t* p, uint8_t* q) {
            q[0] = lumaOf(p[0], p[1], p[2]);
            q[1] = ChromaOf<1>::cb(p[0], p[1], p[2]);
            q[2] = ChromaOf<1>::cr(p[0], p[1], p[2]);
        });
    });
}

Status ZOR_CALL zoriYCbCrToRGB_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                      ImageSize roiSize) {
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(rgbRowSimd(s, d, n), s, d, n, [](const uint8_t* p, uint8_t* q) {
            rgbOf(p[0], p[1] - 128, p[2] - 128, kFullTerms, q, q + 1, q + 2);
        });
    });
}

// The SIMD rows compute the exact rational values that the double formulas
// round (see hsvRowSimd); the generic rows follow the formulas in double.
Status ZOR_CALL zoriRGBToHSV_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                    ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(hsvRowSimd(s, d, n), s, d, n,
                         [](const uint8_t* p, uint8_t* q) { hsvOf(p[0], p[1], p[2], q); });
    });
}

Status ZOR_CALL zoriRGBToYCbCr422_8u_C3C2R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                           ImageSize roiSize) {
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, toPacked422Row);
}

Status ZOR_CALL zoriYCbCr422ToRGB_8u_C2C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                           ImageSize roiSize) {
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, fromPacked422Row);
}

Status ZOR_CALL zoriBGRToYCbCr420_8u_C3P3R(const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3],
                                           const int dstStep[3], ImageSize roiSize) {
    return toPlanar420(pSrc, srcStep, pDst, dstStep, roiSize);
}

Status ZOR_CALL zoriYCbCr420ToBGR_8u_P3C3R(const uint8_t* const pSrc[3], const int srcStep[3], uint8_t* pDst,
                                           int dstStep, ImageSize roiSize) {
    return fromPlanar420(pSrc, srcStep, pDst, dstStep, roiSize);
}

Status ZOR_CALL zoriRGBToGray_8u_C3C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                       ImageSize roiSize) {
    return grayRows<3>(pSrc, srcStep, pDst, dstStep, roiSize, nullptr);
}

Status ZOR_CALL zoriColorToGray_8u_C3C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                         ImageSize roiSize, const float coeffs[3]) {
    return grayRows<3>(pSrc, srcStep, pDst, dstStep, roiSize, coeffs);
}

Status ZOR_CALL zoriColorToGray_8u_AC4C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                          ImageSize roiSize, const float coeffs[3]) {
    return grayRows<4>(pSrc, srcStep, pDst, dstStep, roiSize, coeffs);
}

#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

Status ZOR_CALL zoriHSVToRGB_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                    ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(0, s, d, n, [](const uint8_t* p, uint8_t* q) { rgbOfHsv(p[0], p[1], p[2], q); });
    });
}

Status ZOR_CALL zoriRGBToHLS_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                    ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(0, s, d, n, [](const uint8_t* p, uint8_t* q) { hlsOf(p[0], p[1], p[2], q); });
    });
}

Status ZOR_CALL zoriHLSToRGB_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                    ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize, [](const uint8_t* s, uint8_t* d, int n) {
        pixelsFrom<3, 3>(0, s, d, n, [](const uint8_t* p, uint8_t* q) { rgbOfHls(p[0], p[1], p[2], q); });
    });
}

Status ZOR_CALL zoriRGBToYCC_16s_C3R(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                     ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize,
                   [](const int16_t* s, int16_t* d, int n) { pixelsFrom<3, 3>(0, s, d, n, yccOf); });
}

Status ZOR_CALL zoriYCCToRGB_16s_C3R(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                     ImageSize roiSize) {
    DoublePrecisionScope precision;
    return eachRow(pSrc, srcStep, pDst, dstStep, roiSize,
                   [](const int16_t* s, int16_t* d, int n) { pixelsFrom<3, 3>(0, s, d, n, rgbOfYcc); });
}

Status ZOR_CALL zoriColorToGray_16u_C3C1R(const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                          ImageSize roiSize, const float coeffs[3]) {
    return gray16Rows<3>(pSrc, srcStep, pDst, dstStep, roiSize, coeffs);
}

Status ZOR_CALL zoriColorToGray_16u_AC4C1R(const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep,
                                           ImageSize roiSize, const float coeffs[3]) {
    return gray16Rows<4>(pSrc, srcStep, pDst, dstStep, roiSize, coeffs);
}

#endif

}}  // namespace zor::ZOR_NS

#endif  // ZOR_VARIANT != 1
