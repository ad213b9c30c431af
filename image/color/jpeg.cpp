// Baseline JPEG building blocks: full-range BGR to Y and to planar YCbCr,
// 2 x 2 down-sampling, the 16 x 8 BGR tile to a level-shifted 4:2:2 MCU and
// back to packed pixels, the forward DCT with quantisation, dequantisation
// with the inverse DCT, and the forward quantisation table.
//
// Each function checks in its own order (pointers, steps, sizes as listed at
// each export) and writes nothing on failure.  The transforms' fixed-point
// flow is documented in the manifest and in jpeg_kernels.h.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/status.h"
#include "image/color/color_kernels.h"
#include "image/color/color_pixels.h"
#include "image/color/jpeg_kernels.h"

// Every entry is generic or integer work: the SSE variant has none of its own.
#if ZOR_VARIANT != 1

namespace zor { namespace ZOR_NS {
namespace {

using namespace jpeg;

// Natural index i -> position of i in the zigzag sequence.
constexpr uint8_t kZigzagPosition[64] = {
    0,  1,  5,  6,  14, 15, 27, 28, 2,  4,  7,  13, 16, 26, 29, 42, 3,  8,  12, 17, 25, 30,
    41, 43, 9,  11, 18, 24, 31, 40, 44, 53, 10, 19, 23, 32, 39, 45, 52, 54, 20, 22, 33, 38,
    46, 51, 55, 60, 21, 34, 37, 47, 50, 56, 59, 61, 35, 36, 48, 49, 57, 58, 62, 63};

template <class Row>
void eachRow(const uint8_t* pSrc, int srcStep, ImageSize roi, Row&& row) {
    for (int y = 0; y < roi.height; ++y) row(rowAt(pSrc, srcStep, y), y);
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

// Checks: pointers, steps, then the size.
Status ZOR_CALL zoriBGRToY_JPEG_8u_C3C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                         ImageSize roiSize) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badSteps(srcStep, dstStep), badRoi(roiSize))) return s;
    eachRow(pSrc, srcStep, roiSize, [&](const uint8_t* s, int y) {
        uint8_t* d = rowAt(pDst, dstStep, y);
        for (int x = lumaRowSimd(s, d, roiSize.width); x < roiSize.width; ++x)
            d[x] = lumaOf(s[3 * x + 2], s[3 * x + 1], s[3 * x]);
    });
    return StatusOk;
}

// Checks: the source, the plane array and each plane, steps, then the size.
Status ZOR_CALL zoriBGRToYCbCr_JPEG_8u_C3P3R(const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3],
                                             int dstStep, ImageSize roiSize) {
    if (pSrc == nullptr || pDst == nullptr || pDst[0] == nullptr || pDst[1] == nullptr || pDst[2] == nullptr)
        return StatusNullPointer;
    if (Status s = checkFirst(badSteps(srcStep, dstStep), badRoi(roiSize))) return s;
    eachRow(pSrc, srcStep, roiSize, [&](const uint8_t* s, int y) {
        uint8_t* d[3] = {rowAt(pDst[0], dstStep, y), rowAt(pDst[1], dstStep, y), rowAt(pDst[2], dstStep, y)};
        for (int x = planesRowSimd(s, d, roiSize.width); x < roiSize.width; ++x) {
            const int b = s[3 * x], g = s[3 * x + 1], r = s[3 * x + 2];
            d[0][x] = lumaOf(r, g, b);
            d[1][x] = cbOf(r, g, b);
            d[2][x] = crOf(r, g, b);
        }
    });
    return StatusOk;
}

// The destination ROI governs the loop; the source ROI is only validated.
// Checks: source, its step and size, then destination, its step and size.
Status ZOR_CALL zoriSampleDownH2V2_JPEG_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize,
                                               uint8_t* pDst, int dstStep, ImageSize dstRoiSize) {
    if (Status s = checkFirst(anyNull(pSrc), badSteps(srcStep), badRoi(srcRoiSize), anyNull(pDst),
                              badSteps(dstStep), badRoi(dstRoiSize)))
        return s;
    for (int y = 0; y < dstRoiSize.height; ++y) {
        const uint8_t* s0 = rowAt(pSrc, srcStep, 2 * y);
        const uint8_t* s1 = rowAt(pSrc, srcStep, 2 * y + 1);
        uint8_t* d = rowAt(pDst, dstStep, y);
        for (int x = sampleDownRowSimd(s0, s1, d, dstRoiSize.width); x < dstRoiSize.width; ++x)
            d[x] = static_cast<uint8_t>((s0[2 * x] + s0[2 * x + 1] + s1[2 * x] + s1[2 * x + 1] + 3) >> 2);
    }
    return StatusOk;
}

// Checks: source or plane array, the source step, then each plane.
Status ZOR_CALL zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R(const uint8_t* pSrc, int srcStep, int16_t* const pDstMCU[3]) {
    if (pSrc == nullptr || pDstMCU == nullptr) return StatusNullPointer;
    if (Status s = badSteps(srcStep)) return s;
    if (pDstMCU[0] == nullptr || pDstMCU[1] == nullptr || pDstMCU[2] == nullptr) return StatusNullPointer;
    int16_t* luma = pDstMCU[0];
    for (int r = 0; r < 8; ++r) {
        const uint8_t* s = rowAt(pSrc, srcStep, r);
        if (mcuRowSimd(s, luma + r * 8, luma + 64 + r * 8, pDstMCU[1] + r * 8, pDstMCU[2] + r * 8)) continue;
        for (int x = 0; x < 16; ++x) {
            const int b = s[3 * x], g = s[3 * x + 1], red = s[3 * x + 2];
            // the luma truncated, then centred: no rounding term
            luma[(x < 8 ? 0 : 64) + r * 8 + x % 8] =
                static_cast<int16_t>((((19595 * red + 38470 * g + 7471 * b) & ~0xFFFF) - 8388608) >> 16);
        }
        for (int j = 0; j < 8; ++j) {
            const uint8_t* p = s + 6 * j;
            const int bs = p[0] + p[3], gs = p[1] + p[4], rs = p[2] + p[5];
            pDstMCU[1][r * 8 + j] = static_cast<int16_t>((-11059 * rs - 21709 * gs + 32768 * bs) >> 17);
            pDstMCU[2][r * 8 + j] = static_cast<int16_t>((32768 * rs - 27439 * gs - 5329 * bs) >> 17);
        }
    }
    return StatusOk;
}

// Checks: plane array or destination, each plane, then the step.
Status ZOR_CALL zoriJoin422LS_MCU_16s8u_P3C2R(const int16_t* const pSrcMCU[3], uint8_t* pDst, int dstStep) {
    if (pSrcMCU == nullptr || pDst == nullptr) return StatusNullPointer;
    if (pSrcMCU[0] == nullptr || pSrcMCU[1] == nullptr || pSrcMCU[2] == nullptr) return StatusNullPointer;
    if (Status s = badSteps(dstStep)) return s;
    const auto level = [](int v) { return color::clampByte(v + 128); };
    const int16_t* luma = pSrcMCU[0];
    for (int r = 0; r < 8; ++r) {
        uint8_t* d = rowAt(pDst, dstStep, r);
        if (joinRowSimd(luma + r * 8, luma + 64 + r * 8, pSrcMCU[1] + r * 8, pSrcMCU[2] + r * 8, d)) continue;
        for (int j = 0; j < 8; ++j, d += 4) {
            const int16_t* y = pSrcMCU[0] + (j < 4 ? 0 : 64) + r * 8 + 2 * (j % 4);
            d[0] = level(y[0]);
            d[1] = level(pSrcMCU[1][r * 8 + j]);
            d[2] = level(y[1]);
            d[3] = level(pSrcMCU[2][r * 8 + j]);
        }
    }
    return StatusOk;
}

// Checks: source or destination, the source step, then the table.
Status ZOR_CALL zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(const uint8_t* pSrc, int srcStep, int16_t* pDst,
                                                    const uint16_t* pQuantFwdTable) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badSteps(srcStep), anyNull(pQuantFwdTable))) return s;
    if (dctQuantFwdSimd(pSrc, srcStep, pDst, pQuantFwdTable)) return StatusOk;
    int rows[64];
    for (int r = 0; r < 8; ++r) {
        const uint8_t* s = rowAt(pSrc, srcStep, r);
        int x[8];
        for (int k = 0; k < 8; ++k) x[k] = s[k] - 128;
        int X[8];
        forward8<false>(x, X);
        for (int k = 0; k < 8; ++k) rows[r * 8 + k] = static_cast<int16_t>(X[k]);
    }
    for (int u = 0; u < 8; ++u) {
        int col[8], X[8];
        for (int v = 0; v < 8; ++v) col[v] = rows[v * 8 + u];
        forward8<true>(col, X);
        for (int v = 0; v < 8; ++v)
            pDst[v * 8 + u] = saturate<int16_t>(scaleRound(int64_t(pQuantFwdTable[v * 8 + u]) * X[v], 15));
    }
    return StatusOk;
}

#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

// Checks: source or destination, the destination step, then the table.
Status ZOR_CALL zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R(const int16_t* pSrc, uint8_t* pDst, int dstStep,
                                                    const uint16_t* pQuantInvTable) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badSteps(dstStep), anyNull(pQuantInvTable))) return s;
    int64_t coef[64], cols[64];
    for (int i = 0; i < 64; ++i) coef[i] = saturate<int16_t>(int32_t(pSrc[i]) * pQuantInvTable[i]);
    for (int u = 0; u < 8; ++u) inverse8(coef + u, 8, cols + u, 8, 27);  // columns, kept at 2^3
    for (int y = 0; y < 8; ++y) {
        int64_t x[8];
        inverse8(cols + 8 * y, 1, x, 1, 36);  // rows, / 8 for the normalisation
        uint8_t* d = rowAt(pDst, dstStep, y);
        for (int k = 0; k < 8; ++k) d[k] = static_cast<uint8_t>(x[k] < -128 ? 0 : x[k] > 127 ? 255 : x[k] + 128);
    }
    return StatusOk;
}

// Reciprocals in 1.15 fixed point, natural order; a zero entry becomes 65535
// and the table is still finished.
Status ZOR_CALL zoriQuantFwdTableInit_JPEG_8u16u(const uint8_t* pQuantRawTable, uint16_t* pQuantFwdTable) {
    if (Status s = anyNull(pQuantRawTable, pQuantFwdTable)) return s;
    uint16_t table[64];
    Status status = StatusOk;
    for (int i = 0; i < 64; ++i) {
        const uint32_t q = pQuantRawTable[kZigzagPosition[i]];
        if (q == 0) {
            table[i] = 65535;
            status = StatusWarnDivByZero;
            continue;
        }
        const uint32_t t = 0x80000000u / q;
        table[i] = static_cast<uint16_t>((t + 32767 + 2 * ((t >> 16) & 1)) >> 16);
    }
    for (int i = 0; i < 64; ++i) pQuantFwdTable[i] = table[i];
    return status;
}

#endif

}}  // namespace zor::ZOR_NS

#endif  // ZOR_VARIANT != 1
