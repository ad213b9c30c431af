// In-place grey-level dilation (maximum) and erosion (minimum).
//
// Results are computed into a small ring of row buffers and each is copied
// back into the image only once no later output row reads the source row it
// replaces: with anchor row ay, output row y reads source rows y - ay and
// below, so result row y - ay - 1 may be written back before row y is
// computed.  The 3x3 forms are the case ay = 1 (two buffers); the masked
// forms use ay + 1 buffers.  The caller supplies the border pixels.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/memory.h"
#include "frame/status.h"
#include "image/filter/extreme3x3.h"

#include <cstddef>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

// ---- 3x3 ----------------------------------------------------------------------------

// One result row from source rows above, at and below p (column 0).
template <class Op, class T>
void row3x3(T* p, int step, T* out, int w) {
    if constexpr (sizeof(T) == 1) {
        extreme3x3Row<Op>(rowAt(p, step, -1) - 1, step, out, w);
    } else {
        const T* a = rowAt(p, step, -1);
        const T* b = p;
        const T* c = rowAt(p, step, 1);
        for (int x = 0; x < w; ++x) {
            T v = a[x - 1];
            for (int i = -1; i <= 1; ++i) v = Op::pick(Op::pick(Op::pick(v, a[x + i]), b[x + i]), c[x + i]);
            out[x] = v;
        }
    }
}

// ---- masked -------------------------------------------------------------------------

struct MaskTaps {
    int count;
    ptrdiff_t* offsets;  // byte offsets from the output pixel, row by row
};

template <class Op>
void rowMasked(uint8_t* p, const MaskTaps& taps, uint8_t* out, int w) {
    int x = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    for (; x + V::kLanes <= w; x += V::kLanes) {
        V v = simd::load<V>(p + x + taps.offsets[0]);
        for (int t = 1; t < taps.count; ++t) v = Op::pick(v, simd::load<V>(p + x + taps.offsets[t]));
        simd::store(out + x, v);
    }
#endif
    for (; x < w; ++x) {
        uint8_t v = p[x + taps.offsets[0]];
        for (int t = 1; t < taps.count; ++t) v = Op::pick(v, p[x + taps.offsets[t]]);
        out[x] = v;
    }
}

// The in-place schedule with `depth` result buffers: result row y goes
// into buffer y % depth after that buffer's previous row (y - depth) has
// been written back.
template <class T, class RowFn>
Status inPlace(T* img, int step, ImageSize roi, int depth, RowFn computeRow) {
    const size_t rowBytes = (size_t(roi.width) * sizeof(T) + 15) & ~size_t(15);
    const uint64_t bytes = uint64_t(rowBytes) * uint64_t(depth);
    if (bytes > 0x7FFFFFFFu) return StatusNoMemory;
    uint8_t* ring = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(bytes)));
    if (!ring) return StatusNoMemory;
    auto buf = [&](int y) { return reinterpret_cast<T*>(ring + size_t(y % depth) * rowBytes); };
    const size_t copyBytes = size_t(roi.width) * sizeof(T);
    for (int y = 0; y < roi.height; ++y) {
        if (y >= depth) std::memcpy(rowAt(img, step, y - depth), buf(y), copyBytes);
        computeRow(rowAt(img, step, y), buf(y));
    }
    for (int y = roi.height > depth ? roi.height - depth : 0; y < roi.height; ++y)
        std::memcpy(rowAt(img, step, y), buf(y), copyBytes);
    mem::alignedFree(ring);
    return StatusOk;
}

template <class Op, class T>
Status morph3x3(T* img, int step, ImageSize roi) {
    if (!img) return StatusNullPointer;
    if (step < 1) return StatusBadStep;
    if (roi.width < 1 || roi.height < 1) return StatusBadSize;
    // the row must hold the ROI plus one border pixel on each side
    if (step < (static_cast<int64_t>(roi.width) + 2) * static_cast<int64_t>(sizeof(T)))
        return StatusStepBelowRow;
    return inPlace(img, step, roi, 2,
                   [&](T* p, T* out) { row3x3<Op>(p, step, out, roi.width); });
}

template <class Op>
Status morphMasked(uint8_t* img, int step, ImageSize roi, const uint8_t* mask, ImageSize maskSize,
                   ImagePoint anchor) {
    if (!img || !mask) return StatusNullPointer;
    if (step < 1) return StatusBadStep;
    if (roi.width < 1 || roi.height < 1) return StatusBadSize;
    if (maskSize.width < 1 || maskSize.height < 1) return StatusBadMaskSize;
    const size_t n = size_t(maskSize.width) * size_t(maskSize.height);
    size_t nonzero = 0;
    for (size_t i = 0; i < n; ++i) nonzero += mask[i] != 0;
    if (nonzero == 0) return StatusZeroMask;
    if (anchor.x < 0 || anchor.x >= maskSize.width || anchor.y < 0 || anchor.y >= maskSize.height)
        return StatusBadAnchor;
    if (static_cast<int64_t>(roi.width) + maskSize.width - 1 > step) return StatusStepBelowRow;
    if (uint64_t(nonzero) * sizeof(ptrdiff_t) > 0x7FFFFFFFu) return StatusNoMemory;
    ptrdiff_t* offsets =
        static_cast<ptrdiff_t*>(mem::alignedAlloc(static_cast<uint32_t>(nonzero * sizeof(ptrdiff_t))));
    if (!offsets) return StatusNoMemory;
    MaskTaps taps{0, offsets};
    for (int j = 0; j < maskSize.height; ++j)
        for (int i = 0; i < maskSize.width; ++i)
            if (mask[size_t(j) * maskSize.width + i])
                offsets[taps.count++] = static_cast<ptrdiff_t>(j - anchor.y) * step + (i - anchor.x);
    const Status s = inPlace(img, step, roi, anchor.y + 1,
                             [&](uint8_t* p, uint8_t* out) { rowMasked<Op>(p, taps, out, roi.width); });
    mem::alignedFree(offsets);
    return s;
}

}  // namespace

Status ZOR_CALL zoriDilate3x3_8u_C1IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize) {
    return morph3x3<PickMax>(pSrcDst, srcDstStep, roiSize);
}

Status ZOR_CALL zoriErode3x3_8u_C1IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize) {
    return morph3x3<PickMin>(pSrcDst, srcDstStep, roiSize);
}

Status ZOR_CALL zoriErode3x3_32f_C1IR(float* pSrcDst, int srcDstStep, ImageSize roiSize) {
    return morph3x3<PickMin>(pSrcDst, srcDstStep, roiSize);
}

Status ZOR_CALL zoriDilate_8u_C1IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize,
                                   const uint8_t* pMask, ImageSize maskSize, ImagePoint anchor) {
    return morphMasked<PickMax>(pSrcDst, srcDstStep, roiSize, pMask, maskSize, anchor);
}

Status ZOR_CALL zoriErode_8u_C1IR(uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize,
                                  const uint8_t* pMask, ImageSize maskSize, ImagePoint anchor) {
    return morphMasked<PickMin>(pSrcDst, srcDstStep, roiSize, pMask, maskSize, anchor);
}

}}  // namespace zor::ZOR_NS
