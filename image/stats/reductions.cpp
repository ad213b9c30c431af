// Image reductions: sums, means, mean and deviation of one channel, extrema
// with and without positions, the L1 norm of a difference.
//
// Every result is defined row by row: integer rows are summed exactly (in
// 32 bits, or 64 where squares need it) and each row total is added to the
// running result, top to bottom.  The row kernels (reductions_kernels.h)
// give the same row results in every variant, so the variants agree bit for
// bit; the one exception is the fast float sum, which the SIMD variants use
// for zoriSum_32f_C1R unless the accurate method (hint 2) is asked for.
// Extrema do not depend on order, except for which of +0 and -0 (and of
// NaNs) comes first; those cases are settled by a scan in raster order.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"
#include "image/stats/reductions_kernels.h"

#include <cmath>
#include <cstdint>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

constexpr int kAccurateSum = 2;

// Checks of the C3CR forms: source, size, step against the row, the 16-bit
// forms' odd step, then the channel of interest.
template <class T>
Status checkChannelOfInterest(const T* src, int step, ImageSize roi, int coi) {
    if (Status s = checkFirst(anyNull(src), badRoi(roi))) return s;
    if (step < 3 * int(sizeof(T)) * roi.width) return StatusBadStep;
    if (sizeof(T) == 2 && step % 2 != 0) return StatusNotEvenStep;
    return coi < 1 || coi > 3 ? StatusBadChannelOfInterest : StatusOk;
}

double pixelCount(ImageSize roi) { return double(roi.width) * double(roi.height); }

// The sum of row totals rowTotal(row), each added to a double.
template <class T, class RowTotal>
double sumOfRows(const T* src, int step, ImageSize roi, RowTotal rowTotal) {
    double total = 0.0;
    for (int y = 0; y < roi.height; ++y) total += double(rowTotal(rowAt(src, step, y)));
    return total;
}

// Sum of a (or of |a - b|) by rows: each row total in 32 bits, added to a
// double.  A row total wraps only past 16843009 pixels, and the double sum
// of row totals is exact below 2^53 (more than 35 TB of pixels), so below
// that width the rows share one exact 64-bit sum and its accumulators.
template <bool Diff>
double byteSumOfRows(const uint8_t* a, int aStep, const uint8_t* b, int bStep, ImageSize roi) {
    constexpr int kRowsNeverWrap = 16843009;  // 255 * 16843009 < 2^32
    double total = 0.0;
    ByteSum<Diff> sum;
    for (int y = 0; y < roi.height; ++y) {
        const uint8_t* rowB = Diff ? rowAt(b, bStep, y) : nullptr;
        if (roi.width <= kRowsNeverWrap) {
            sum.addRow(rowAt(a, aStep, y), rowB, roi.width);
            continue;
        }
        ByteSum<Diff> row;
        row.addRow(rowAt(a, aStep, y), rowB, roi.width);
        total += double(uint32_t(row.total()));
    }
    return total + double(sum.total());
}

// Accurate float sum: one double accumulator over the even columns, one over
// the odd columns, across the whole ROI.  Each step is a double addition of
// a float; under the 53-bit precision control the x87 variants round every
// step as SSE does (no sum of floats reaches the double denormals).
double accurateSum32f(const float* src, int step, ImageSize roi) {
    double even = 0.0, odd = 0.0;
    for (int y = 0; y < roi.height; ++y) {
        const float* s = rowAt(src, step, y);
        int x = 0;
        for (; x + 2 <= roi.width; x += 2) {
            even += s[x];
            odd += s[x + 1];
        }
        if (x < roi.width) even += s[x];
    }
    return odd + even;
}

// The extrema of a float image by the sequential rule, v becoming the
// minimum when !(v >= min), else the maximum when v > max, as the pixels
// that hold them: their bits are copied out, never loaded as floats (an x87
// load would quieten a signalling NaN).
struct Extremes {
    const float* min;
    const float* max;
};
Extremes sequentialExtremes32f(const float* src, int step, ImageSize roi) {
    Extremes e{src, src};
    for (int y = 0; y < roi.height; ++y) {
        const float* s = rowAt(src, step, y);
        for (int x = 0; x < roi.width; ++x) {
            if (!(s[x] >= *e.min)) e.min = s + x;
            else if (s[x] > *e.max) e.max = s + x;
        }
    }
    return e;
}

// The first zero in raster order (there is one).
const float* firstZero32f(const float* src, int step, ImageSize roi) {
    for (int y = 0; y < roi.height; ++y) {
        const float* s = rowAt(src, step, y);
        for (int x = 0; x < roi.width; ++x)
            if (s[x] == 0.0f) return s + x;
    }
    return src;
}

// Without NaNs the sequential rule keeps the first occurrence of the least
// and of the greatest value, which differs from the others only for zeros
// (+0 or -0); any NaN sends the scan to the rule itself.
void extremes32f(const float* src, int step, ImageSize roi, float* pMin, float* pMax) {
    Range32f m{src[0], src[0]};
    bool ordered = src[0] == src[0];
    for (int y = 0; y < roi.height && ordered; ++y) ordered = rowRange32f(rowAt(src, step, y), roi.width, m);
    const Extremes e = ordered ? Extremes{m.min == 0.0f ? firstZero32f(src, step, roi) : &m.min,
                                          m.max == 0.0f ? firstZero32f(src, step, roi) : &m.max}
                               : sequentialExtremes32f(src, step, roi);
    std::memcpy(pMin, e.min, sizeof *pMin);
    std::memcpy(pMax, e.max, sizeof *pMax);
}

// Sum and sum of squares of one channel, mean and population deviation.
template <class T, class Row>
Status meanStdDev(const T* src, int step, ImageSize roi, int coi, double* pMean, double* pStdDev, Row row) {
    if (Status s = checkChannelOfInterest(src, step, roi, coi)) return s;
    SumSquares t;
    for (int y = 0; y < roi.height; ++y) {
        const SumSquares r = row(rowAt(src, step, y), roi.width, coi - 1);
        t.sum += r.sum;
        t.squares += r.squares;
    }
    DoublePrecisionScope precision;
    const double n = pixelCount(roi);
    const double mean = toDouble(toDouble(double(t.sum)) / n);
    const double meanOfSquares = toDouble(toDouble(double(t.squares)) / n);
    if (pMean) *pMean = mean;
    if (pStdDev) *pStdDev = toDouble(std::sqrt(std::fabs(toDouble(meanOfSquares - toDouble(mean * mean)))));
    return StatusOk;
}

// The first x of row with channel c equal to v.
inline int firstInRow16u(const uint16_t* row, int w, int c, uint16_t v) {
    for (int x = 0; x < w; ++x)
        if (row[3 * x + c] == v) return x;
    return 0;
}

}  // namespace

// ---- sums and means ------------------------------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zoriSum_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, double* pSum) {
    if (Status s = checkFirst(anyNull(pSrc, pSum), badRoi(roiSize))) return s;
    *pSum = byteSumOfRows<false>(pSrc, srcStep, nullptr, 0, roiSize);
    return StatusOk;
}

Status ZOR_CALL zoriMean_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, double* pMean) {
    if (Status s = checkFirst(anyNull(pMean), anyNull(pSrc), badRoi(roiSize))) return s;
    const double sum = byteSumOfRows<false>(pSrc, srcStep, nullptr, 0, roiSize);
    DoublePrecisionScope precision;
    *pMean = toDouble(sum / pixelCount(roiSize));
    return StatusOk;
}

// Each channel's sum times the reciprocal of the pixel count.
Status ZOR_CALL zoriMean_8u_C3R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, double pMean[3]) {
    if (Status s = checkFirst(anyNull(pMean), anyNull(pSrc), badRoi(roiSize))) return s;
    double total[3] = {0.0, 0.0, 0.0};
    for (int y = 0; y < roiSize.height; ++y) {
        uint32_t row[3] = {0, 0, 0};
        rowChannelSums8u(rowAt(pSrc, srcStep, y), roiSize.width, row);
        for (int c = 0; c < 3; ++c) total[c] += double(row[c]);
    }
    DoublePrecisionScope precision;
    const double reciprocal = toDouble(1.0 / pixelCount(roiSize));
    for (int c = 0; c < 3; ++c) pMean[c] = toDouble(total[c] * reciprocal);
    return StatusOk;
}

Status ZOR_CALL zoriMean_StdDev_8u_C3CR(const uint8_t* pSrc, int srcStep, ImageSize roiSize, int coi,
                                        double* pMean, double* pStdDev) {
    return meanStdDev(pSrc, srcStep, roiSize, coi, pMean, pStdDev, rowChannelSquares8u);
}

Status ZOR_CALL zoriMean_StdDev_16u_C3CR(const uint16_t* pSrc, int srcStep, ImageSize roiSize, int coi,
                                         double* pMean, double* pStdDev) {
    return meanStdDev(pSrc, srcStep, roiSize, coi, pMean, pStdDev, rowChannelSquares16u);
}

Status ZOR_CALL zoriNormDiff_L1_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                       ImageSize roiSize, double* pValue) {
    if (Status s = checkFirst(anyNull(pSrc1, pSrc2, pValue), badRoi(roiSize), badSteps(src1Step, src2Step)))
        return s;
    *pValue = byteSumOfRows<true>(pSrc1, src1Step, pSrc2, src2Step, roiSize);
    return StatusOk;
}
#endif

Status ZOR_CALL zoriSum_32f_C1R(const float* pSrc, int srcStep, ImageSize roiSize, double* pSum, int hint) {
    if (Status s = checkFirst(anyNull(pSrc, pSum), badRoi(roiSize))) return s;
    DoublePrecisionScope precision;
#if ZOR_SIMD >= 1
    if (hint != kAccurateSum) {
        *pSum = toDouble(sumOfRows(pSrc, srcStep, roiSize,
                                   [&](const float* r) { return rowSumFast32f(r, roiSize.width); }));
        return StatusOk;
    }
#else
    (void)hint;
#endif
    *pSum = toDouble(accurateSum32f(pSrc, srcStep, roiSize));
    return StatusOk;
}

// ---- extrema ------------------------------------------------------------------------------

Status ZOR_CALL zoriMinMax_32f_C1R(const float* pSrc, int srcStep, ImageSize roiSize, float* pMin, float* pMax) {
    if (Status s = checkFirst(anyNull(pSrc, pMin, pMax), badRoi(roiSize))) return s;
    extremes32f(pSrc, srcStep, roiSize, pMin, pMax);
    return StatusOk;
}

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
// Stops after the row from which the minima are all 0 and the maxima 255.
Status ZOR_CALL zoriMinMax_8u_C3R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, uint8_t pMin[3],
                                  uint8_t pMax[3]) {
    if (Status s = checkFirst(anyNull(pSrc, pMin, pMax), badRoi(roiSize))) return s;
    uint8_t mn[3] = {pSrc[0], pSrc[1], pSrc[2]}, mx[3] = {pSrc[0], pSrc[1], pSrc[2]};
    for (int y = 0; y < roiSize.height; ++y) {
        rowMinMax8uC3(rowAt(pSrc, srcStep, y), roiSize.width, mn, mx);
        if ((mn[0] | mn[1] | mn[2]) == 0 && mx[0] + mx[1] + mx[2] == 765) break;
    }
    for (int c = 0; c < 3; ++c) {
        pMin[c] = mn[c];
        pMax[c] = mx[c];
    }
    return StatusOk;
}

// Stops after the row in which the maximum reached 255.
Status ZOR_CALL zoriMax_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, uint8_t* pMax) {
    if (Status s = checkFirst(anyNull(pSrc, pMax), badRoi(roiSize))) return s;
    uint8_t m = pSrc[0];
    for (int y = 0; y < roiSize.height && m != 255; ++y)
        m = maxOf(m, rowMax8u(rowAt(pSrc, srcStep, y), roiSize.width));
    *pMax = m;
    return StatusOk;
}

// The extrema of each row; a row replaces the kept minimum (maximum) only
// when strictly smaller (greater), so the kept row is the first that holds
// the value, and the first x in it equal to the value completes the first
// occurrence in raster order.  Null result pointers are skipped.
Status ZOR_CALL zoriMinMaxIndx_16u_C3CR(const uint16_t* pSrc, int srcStep, ImageSize roiSize, int coi,
                                        float* pMinVal, float* pMaxVal, ImagePoint* pMinIndex,
                                        ImagePoint* pMaxIndex) {
    if (Status s = checkChannelOfInterest(pSrc, srcStep, roiSize, coi)) return s;
    const int c = coi - 1;
    Range16u m;
    int minRow = 0, maxRow = 0;
    for (int y = 0; y < roiSize.height; ++y) {
        const Range16u r = rowRange16u(rowAt(pSrc, srcStep, y), roiSize.width, c);
        if (r.min < m.min) {
            m.min = r.min;
            minRow = y;
        }
        if (r.max > m.max) {
            m.max = r.max;
            maxRow = y;
        }
    }
    if (pMinVal) *pMinVal = float(m.min);
    if (pMaxVal) *pMaxVal = float(m.max);
    if (pMinIndex) *pMinIndex = {firstInRow16u(rowAt(pSrc, srcStep, minRow), roiSize.width, c, m.min), minRow};
    if (pMaxIndex) *pMaxIndex = {firstInRow16u(rowAt(pSrc, srcStep, maxRow), roiSize.width, c, m.max), maxRow};
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
