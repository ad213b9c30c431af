// Canny edge detection from two 16-bit derivative images.
//
// One pass over the rows computes L1 magnitudes (|dx| + |dy|, cleared to 0
// when not above the truncated low threshold) into a ring of three framed
// rows and, one row behind, suppresses non-maxima along one of four
// quantised gradient directions.  Survivors are marked in a framed
// candidate map; survivors above the high threshold become edges at once and
// are pushed on a stack.  A last pass pops the stack (last in, first out) and
// grows the edges into every neighbouring candidate.
//
// The vector variants keep the same results with less memory traffic:
// 16-bit magnitudes, suppression 8 pixels at a time on the blocks that keep
// a magnitude, a candidate bitmap instead of the byte map, and growth every
// 16 rows through the rows already settled, while they are in the cache
// (the grown set, every candidate connected to a strong pixel, does not
// depend on the order of the visits).
//
// Tie rules, deliberately asymmetric: along horizontal and vertical
// gradients a pixel must beat the neighbour before it and only match the one
// after it (a plateau keeps its left or upper pixel); along diagonals it must
// beat both.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/status.h"
#include "image/filter/canny_kernels.h"

#include <climits>
#include <cmath>
#include <cstddef>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

// Stack coordinates fit 16 bits unless a padded side reaches 65535.
inline bool wideCoordinates(ImageSize roi) {
    return !(static_cast<int64_t>(roi.width) + 2 < 65535 && static_cast<int64_t>(roi.height) + 2 < 65535);
}

[[maybe_unused]] Status cannySize(ImageSize roi, int* size) {
    if (!size) return StatusNullPointer;
    if (Status s = badRoi(roi)) return s;
    const int64_t padded = (static_cast<int64_t>(roi.width) + 2) * (static_cast<int64_t>(roi.height) + 2);
    if (padded > INT_MAX) return StatusBadSize;  // (tested first: 9 x padded could pass 64 bits)
    const int64_t bytes = (wideCoordinates(roi) ? 9 : 5) * padded + 16 * static_cast<int64_t>(roi.width) + 160;
    if (bytes > INT_MAX) return StatusBadSize;  // not expressible as an int
    *size = static_cast<int>(bytes);
    return StatusOk;
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zoriCannyGetSize(ImageSize roiSize, int* pBufferSize) {
    return cannySize(roiSize, pBufferSize);
}
#endif

Status ZOR_CALL zoriCanny_16s8u_C1R(const int16_t* pSrcDx, int srcDxStep, const int16_t* pSrcDy,
                                    int srcDyStep, uint8_t* pDstEdges, int dstEdgeStep,
                                    ImageSize roiSize, float lowThreshold, float highThreshold,
                                    uint8_t* pBuffer) {
    if (Status s = checkFirst(anyNull(pSrcDx, pSrcDy, pDstEdges, pBuffer), badRoi(roiSize))) return s;
    const int64_t w2 = 2 * static_cast<int64_t>(roiSize.width);
    if (srcDxStep < w2) return StatusBadStep;
    if (srcDyStep < w2 || dstEdgeStep < roiSize.width) return StatusBadStep;
    if ((srcDxStep & 1) || (srcDyStep & 1)) return StatusNotEvenStep;
    if (!(lowThreshold >= 0) || !(highThreshold >= lowThreshold)) return StatusBadArgument;
    // truncation toward zero; magnitudes never exceed 65536
    const int low = lowThreshold >= 1e9f ? 1000000000 : static_cast<int>(lowThreshold);
    // whole rows up to the step are cleared, deliberately
#if ZOR_SIMD >= 2
    if (roiSize.width >= 8 && low < 65535) {
        // the smallest stored E = M - L with M > highThreshold (M is an integer)
        const double strongFrom = std::floor(static_cast<double>(highThreshold)) + 1.0 - low;
        const int from = strongFrom <= 65535.0 ? static_cast<int>(strongFrom) : -1;
        const bool done =
            wideCoordinates(roiSize)
                ? detectCoded<uint32_t>(pSrcDx, srcDxStep, pSrcDy, srcDyStep, pDstEdges, dstEdgeStep, roiSize, low,
                                        from, pBuffer)
                : detectCoded<uint16_t>(pSrcDx, srcDxStep, pSrcDy, srcDyStep, pDstEdges, dstEdgeStep, roiSize, low,
                                        from, pBuffer);
        if (done) return StatusOk;
    }
#endif
    std::memset(pDstEdges, 0, size_t(roiSize.height) * size_t(dstEdgeStep));
    if (wideCoordinates(roiSize))
        detect<uint32_t>(pSrcDx, srcDxStep, pSrcDy, srcDyStep, pDstEdges, dstEdgeStep, roiSize, low,
                         highThreshold, pBuffer);
    else
        detect<uint16_t>(pSrcDx, srcDxStep, pSrcDy, srcDyStep, pDstEdges, dstEdgeStep, roiSize, low,
                         highThreshold, pBuffer);
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
