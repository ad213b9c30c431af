// Sobel first-derivative filters, 3x3 and 5x5, applied separably: a row pass
// (the weights along x) over every source row the output needs, kept in a
// ring of rows, then a column pass (the weights along y) over the ring.
//
// Neighbourhood weights (dx to the right, dy downward, no flipping):
//   Vert  3x3: x [1 0 -1],        y [1 2 1]         (positive where the left is brighter)
//   Horiz 3x3: x [1 2 1],         y [-1 0 1]        (positive where the bottom is brighter)
//   Vert  5x5: x [1 2 0 -2 -1],   y [1 4 6 4 1]
//   Horiz 5x5: x [1 4 6 4 1],     y [-1 -2 0 2 1]
// The opposite signs of the two directions are intended.
//
// 8u sources: integer sums, exact (the largest magnitude, 255 * 48, fits 16
// bits, so the ring holds 16-bit row sums).  32f sources: each row-pass value
// is its exact sum formed in double and rounded once to float; the column
// pass sums in double and rounds once on store.  Zero weights are skipped
// (an infinite neighbour does not turn a zero weight into NaN).
//
// The plain and mask forms read one (3x3) or two (5x5) pixels around the
// ROI; the border forms read only the ROI and synthesise the rest in the
// caller's buffer (border types documented in zor_manifest.h).
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/status.h"
#include "frame/simd.h"

#include <cstddef>
#include <cstring>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

enum class Dir { Horiz, Vert };

struct SobelKernel {
    int size;    // 3 or 5
    int x[5];    // row pass: weights along x, left to right
    int y[5];    // column pass: weights along y, top to bottom
};

SobelKernel sobelKernel(Dir dir, int size) {
    if (size == 3)
        return dir == Dir::Vert ? SobelKernel{3, {1, 0, -1}, {1, 2, 1}}
                                : SobelKernel{3, {1, 2, 1}, {-1, 0, 1}};
    return dir == Dir::Vert ? SobelKernel{5, {1, 2, 0, -2, -1}, {1, 4, 6, 4, 1}}
                            : SobelKernel{5, {1, 4, 6, 4, 1}, {-1, -2, 0, 2, 1}};
}


// ---- row pass: s points at column 0 and is readable from -r to w - 1 + r ----------

void rowPass(const uint8_t* s, int16_t* out, int w, const SobelKernel& k) {
    const int r = k.size / 2;
    int x = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
    using V = Vec<int16_t>;
    for (; x + V::kLanes <= w; x += V::kLanes) {
        V acc = zero<V>();
        for (int i = 0; i < k.size; ++i) {
            if (k.x[i] == 0) continue;
            acc = acc + loadWidened<V>(s + x - r + i) * set1<V>(static_cast<int16_t>(k.x[i]));
        }
        store(out + x, acc);
    }
#endif
    for (; x < w; ++x) {
        int acc = 0;
        for (int i = 0; i < k.size; ++i) acc += k.x[i] * s[x - r + i];
        out[x] = static_cast<int16_t>(acc);
    }
}

void rowPass(const float* s, float* out, int w, const SobelKernel& k) {
    const int r = k.size / 2;
    for (int x = 0; x < w; ++x) {
        double acc = 0.0;
        for (int i = 0; i < k.size; ++i)
            if (k.x[i] != 0) acc = toDouble(acc + static_cast<double>(s[x - r + i]) * k.x[i]);
        out[x] = toFloat(acc);
    }
}

// ---- column pass over the ring rows, top to bottom ---------------------------------

template <class Out>
void colPass(const int16_t* const* rows, Out* dst, int w, const SobelKernel& k) {
    int x = 0;
#if ZOR_SIMD >= 2
    // sums on the widest registers; 8-bit results are the lower half of a
    // 16-byte register narrowed
    using namespace simd;
    using V = std::conditional_t<sizeof(Out) == 1, Vec<int16_t, 16>, Vec<int16_t>>;
    for (; x + V::kLanes <= w; x += V::kLanes) {
        V acc = zero<V>();
        for (int j = 0; j < k.size; ++j) {
            if (k.y[j] == 0) continue;
            acc = acc + load<V>(rows[j] + x) * set1<V>(static_cast<int16_t>(k.y[j]));
        }
        if constexpr (sizeof(Out) == 1)
            storeHalf(dst + x, narrowSat<uint8_t>(acc, acc));
        else
            store(dst + x, acc);
    }
#endif
    for (; x < w; ++x) {
        int acc = 0;
        for (int j = 0; j < k.size; ++j) acc += k.y[j] * rows[j][x];
        if constexpr (sizeof(Out) == 1)  // 8u output: negative responses are dropped
            dst[x] = static_cast<Out>(acc <= 0 ? 0 : acc > 255 ? 255 : acc);
        else
            dst[x] = static_cast<Out>(acc);
    }
}

void colPass(const float* const* rows, float* dst, int w, const SobelKernel& k) {
    for (int x = 0; x < w; ++x) {
        double acc = 0.0;
        for (int j = 0; j < k.size; ++j)
            if (k.y[j] != 0) acc = toDouble(acc + static_cast<double>(rows[j][x]) * k.y[j]);
        dst[x] = toFloat(acc);
    }
}

// ---- the ring schedule ---------------------------------------------------------------

// rows.row(v) gives source row v (-r .. h - 1 + r) at column 0, readable
// r pixels to each side.  ring holds size rows of w elements, rowStride apart.
template <class In, class Acc, class Out, class Rows>
void sobelRun(const SobelKernel& k, Rows& rows, Acc* ring, size_t rowStride, Out* dst,
              int dstStep, ImageSize roi) {
    DoublePrecisionScope precision;
    const int m = k.size, r = m / 2;
    auto slot = [&](ptrdiff_t v) { return ring + static_cast<size_t>(((v % m) + m) % m) * rowStride; };
    for (ptrdiff_t v = -r; v < r; ++v) rowPass(rows.row(v), slot(v), roi.width, k);
    const Acc* window[5];
    for (int y = 0; y < roi.height; ++y) {
        rowPass(rows.row(y + r), slot(y + r), roi.width, k);
        for (int j = 0; j < m; ++j) window[j] = slot(y - r + j);
        colPass(window, rowAt(dst, dstStep, y), roi.width, k);
    }
}

template <class In>
struct PlainRows {
    const In* src;
    int step;
    const In* row(ptrdiff_t v) const { return rowAt(src, step, v); }
};

template <class In>
using AccOf = std::conditional_t<sizeof(In) == 1, int16_t, float>;

#if ZOR_SIMD >= 2
// 3x3 on 8u sources in a single pass over three source rows, one byte
// register B of pixels (widened into two) at a time.  The sums are exact in
// 16 bits, so this equals the two passes.  The low halves are finished
// before the high halves are begun (the loads are repeated), which keeps
// the working set within the eight registers of the 32-bit build; the
// direction is fixed at compile time and the loop gets a register
// allocation of its own.  Widening works per 16-byte block: the 16-bit
// results of block b's low (high) half go to pixels 16b (16b + 8) on.
template <Dir D, class Out, class B>
[[gnu::noinline]] void sobel3Direct(const uint8_t* src, int srcStep, Out* dst, int dstStep, ImageSize roi) {
    using namespace simd;
    using V = Vec<int16_t, B::kBytes>;
    using Lo = std::false_type;
    using Hi = std::true_type;
    const auto widened = [](const uint8_t* p, auto half) -> V {
        const B v = load<B>(p);
        if constexpr (decltype(half)::value) return bitcast<int16_t>(widenHi(v));
        else return bitcast<int16_t>(widenLo(v));
    };
    const int w = roi.width;
    for (int y = 0; y < roi.height; ++y) {
        // Three row pointers indexed by the one column counter: the loads
        // address base + index + displacement, which leaves the 32-bit build
        // enough general registers to keep the loop out of its stack.
        const uint8_t* top = rowAt(src, srcStep, y - 1);
        const uint8_t* mid = rowAt(src, srcStep, y);
        const uint8_t* bot = rowAt(src, srcStep, y + 1);
        Out* d = rowAt(dst, dstStep, y);
        // The low or high halves of every 16-byte block of results at column x.
        const auto sobel = [&](int x, auto half) -> V {
            if constexpr (D == Dir::Vert) {
                // smooth down the columns x - 1 and x + 1, then left minus right
                const auto smooth = [&](int c) {
                    const V b = widened(mid + c, half);
                    return (widened(top + c, half) + widened(bot + c, half)) + (b + b);
                };
                return smooth(x - 1) - smooth(x + 1);
            } else {
                // bottom minus top in columns x - 1, x, x + 1, then smoothed along the row
                const auto dv = [&](int c) { return widened(bot + c, half) - widened(top + c, half); };
                const V centre = dv(x);
                return (dv(x - 1) + dv(x + 1)) + (centre + centre);
            }
        };
        const auto block = [&](int x) {
            if constexpr (sizeof(Out) == 1) {
                const V lo = sobel(x, Lo{});
                store(d + x, narrowSat<uint8_t>(lo, sobel(x, Hi{})));
            } else {
                storeBlocks(d + x, 16, sobel(x, Lo{}));
                storeBlocks(d + x + 8, 16, sobel(x, Hi{}));
            }
        };
        int x = 0;
        for (; x + B::kLanes <= w; x += B::kLanes) block(x);
        if (x < w) block(w - B::kLanes);  // the last block overlaps the one before
    }
}
#endif

// Plain and mask forms: the ring comes from the allocator.
template <class In, class Out>
Status sobelPlain(const In* src, int srcStep, Out* dst, int dstStep, ImageSize roi, Dir dir,
                  int size) {
    using Acc = AccOf<In>;
#if ZOR_SIMD >= 2
    if constexpr (sizeof(In) == 1) {
        if (size == 3 && roi.width >= 16) {
            const auto direct = [&](auto bytes) {
                using B = decltype(bytes);
                if (dir == Dir::Vert) sobel3Direct<Dir::Vert, Out, B>(src, srcStep, dst, dstStep, roi);
                else sobel3Direct<Dir::Horiz, Out, B>(src, srcStep, dst, dstStep, roi);
            };
            if (roi.width >= simd::Vec<uint8_t>::kLanes) direct(simd::Vec<uint8_t>{});
            else direct(simd::Vec<uint8_t, 16>{});
            return StatusOk;
        }
    }
#endif
    const SobelKernel k = sobelKernel(dir, size);
    const size_t stride = (static_cast<size_t>(roi.width) + 7) & ~size_t(7);
    const uint64_t bytes = uint64_t(stride) * k.size * sizeof(Acc);
    if (bytes > 0x7FFFFFFFu) return StatusNoMemory;
    Acc* ring = static_cast<Acc*>(mem::alignedAlloc(static_cast<uint32_t>(bytes)));
    if (!ring) return StatusNoMemory;
    PlainRows<In> rows{src, srcStep};
    sobelRun<In, Acc, Out>(k, rows, ring, stride, dst, dstStep, roi);
    mem::alignedFree(ring);
    return StatusOk;
}

template <class In, class Out>
Status checkedPlain(const In* src, int srcStep, Out* dst, int dstStep, ImageSize roi, Dir dir,
                    int size) {
    if (Status s = checkFirst(anyNull(src, dst), badRoi(roi), badSteps(srcStep, dstStep)))
        return s;
    return sobelPlain(src, srcStep, dst, dstStep, roi, dir, size);
}

// ---- border forms --------------------------------------------------------------------

enum BorderType { BorderReplicate = 0, BorderConstant = 1, BorderMirror = 2,
                  BorderMirrorRepeat = 3, BorderWrap = 4 };

inline ptrdiff_t modulo(ptrdiff_t i, ptrdiff_t n) { return ((i % n) + n) % n; }

// The source index (0 .. n-1) that stands for index i, or -1 for the
// constant border.  Never leaves 0 .. n-1, also for tiny n.
ptrdiff_t borderIndex(ptrdiff_t i, ptrdiff_t n, int type) {
    if (i >= 0 && i < n) return i;
    switch (type) {
    case BorderReplicate: return i < 0 ? 0 : n - 1;
    case BorderConstant: return -1;
    case BorderMirror: {                 // ... c b | a b c ... (edge not repeated)
        if (n == 1) return 0;
        const ptrdiff_t p = modulo(i, 2 * n - 2);
        return p < n ? p : 2 * n - 2 - p;
    }
    case BorderMirrorRepeat: {           // ... b a | a b c ... (edge repeated)
        const ptrdiff_t p = modulo(i, 2 * n);
        return p < n ? p : 2 * n - 1 - p;
    }
    default: return modulo(i, n);         // wrap
    }
}

// Builds each needed row, border included, in a padded row of the buffer.
template <class In>
struct BorderRows {
    const In* src;
    int step;
    ImageSize roi;
    int type;
    In value;
    int r;
    In* padded;  // w + 2r elements; padded + r is column 0

    const In* row(ptrdiff_t v) {
        const ptrdiff_t sy = borderIndex(v, roi.height, type);
        In* p = padded + r;
        if (sy < 0) {
            for (int x = -r; x < roi.width + r; ++x) p[x] = value;
            return p;
        }
        const In* s = rowAt(src, step, sy);
        std::memcpy(p, s, sizeof(In) * static_cast<size_t>(roi.width));
        for (int x = -r; x < 0; ++x) {
            const ptrdiff_t sx = borderIndex(x, roi.width, type);
            p[x] = sx < 0 ? value : s[sx];
        }
        for (int x = roi.width; x < roi.width + r; ++x) {
            const ptrdiff_t sx = borderIndex(x, roi.width, type);
            p[x] = sx < 0 ? value : s[sx];
        }
        return p;
    }
};

inline uint8_t* alignUp(uint8_t* p, size_t a) {
    return reinterpret_cast<uint8_t*>((reinterpret_cast<uintptr_t>(p) + a - 1) & ~(uintptr_t(a) - 1));
}

// Buffer layout: [align to 16] ring (size rows, stride rounded to 8
// elements) [align to 16] padded row.  Fits the reported size with room to
// spare for every width.
template <class In, class Out>
Status sobelBorder(const In* src, int srcStep, Out* dst, int dstStep, ImageSize roi, int mask,
                   int borderType, In borderValue, uint8_t* buffer, Dir dir) {
    if (Status s = checkFirst(anyNull(src, dst, buffer), badRoi(roi)))
        return s;
    const int64_t rowBytes = static_cast<int64_t>(roi.width) * sizeof(In);
    if (srcStep < rowBytes || dstStep < static_cast<int64_t>(roi.width) * static_cast<int64_t>(sizeof(Out)))
        return StatusBadStep;
    if (sizeof(In) == 1 ? (dstStep & 1) != 0 : (srcStep % 4 != 0 || dstStep % 4 != 0))
        return StatusNotEvenStep;
    if (borderType < 0 || borderType > 4) return StatusBadArgument;
    if (mask != MaskSize3x3 && mask != MaskSize5x5) return StatusBadMaskSize;
    using Acc = AccOf<In>;
    const SobelKernel k = sobelKernel(dir, mask == MaskSize3x3 ? 3 : 5);
    const size_t stride = (static_cast<size_t>(roi.width) + 7) & ~size_t(7);
    Acc* ring = reinterpret_cast<Acc*>(alignUp(buffer, 16));
    In* padded = reinterpret_cast<In*>(
        alignUp(reinterpret_cast<uint8_t*>(ring + stride * k.size), 16));
    BorderRows<In> rows{src, srcStep, roi, borderType, borderValue, k.size / 2, padded};
    sobelRun<In, Acc, Out>(k, rows, ring, stride, dst, dstStep, roi);
    return StatusOk;
}

// Work buffer size; R is the padded row storage of one row.
[[maybe_unused]] Status sobelBufferSize(ImageSize roi, int mask, int* size, bool is32f) {
    if (!size) return StatusNullPointer;
    if (Status s = badRoi(roi)) return s;
    if (mask != MaskSize3x3 && mask != MaskSize5x5) return StatusBadMaskSize;
    const int64_t w = roi.width;
    const bool m3 = mask == MaskSize3x3;
    int64_t bytes;
    if (is32f) {
        const int64_t R = ((w + 3) >> 2) * 16;
        bytes = R * (m3 ? 21 : 25) + (m3 ? 364 : 420);
    } else {
        const int64_t R = ((w + 15) >> 4) * 32;
        bytes = R * (m3 ? 21 : 25) + (m3 ? 372 : 412);
    }
    if (bytes > 0x7FFFFFFF) return StatusBadSize;  // not expressible as an int
    *size = static_cast<int>(bytes);
    return StatusOk;
}

int maskOf32f(int mask) { return mask == MaskSize3x3 ? 3 : 5; }  // anything else is 5x5

}  // namespace

// ---- plain forms --------------------------------------------------------------------

Status ZOR_CALL zoriFilterSobelHoriz_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst,
                                            int dstStep, ImageSize roiSize) {
    return checkedPlain(pSrc, srcStep, pDst, dstStep, roiSize, Dir::Horiz, 3);
}

Status ZOR_CALL zoriFilterSobelHoriz_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                             int dstStep, ImageSize roiSize) {
    return checkedPlain(pSrc, srcStep, pDst, dstStep, roiSize, Dir::Horiz, 3);
}

Status ZOR_CALL zoriFilterSobelVert_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                            int dstStep, ImageSize roiSize) {
    return checkedPlain(pSrc, srcStep, pDst, dstStep, roiSize, Dir::Vert, 3);
}

// ---- mask forms ---------------------------------------------------------------------

// 33 selects 3x3 and every other value 5x5: these two never report a bad mask.
Status ZOR_CALL zoriFilterSobelHorizMask_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                                 int dstStep, ImageSize roiSize, int mask) {
    return checkedPlain(pSrc, srcStep, pDst, dstStep, roiSize, Dir::Horiz, maskOf32f(mask));
}

Status ZOR_CALL zoriFilterSobelVertMask_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                                int dstStep, ImageSize roiSize, int mask) {
    return checkedPlain(pSrc, srcStep, pDst, dstStep, roiSize, Dir::Vert, maskOf32f(mask));
}

namespace {
Status sobel8u16s(const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roi,
                  int mask, Dir dir) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi), badSteps(srcStep, dstStep)))
        return s;
    if (mask != MaskSize3x3 && mask != MaskSize5x5) return StatusBadMaskSize;
    return sobelPlain(pSrc, srcStep, pDst, dstStep, roi, dir, mask == MaskSize3x3 ? 3 : 5);
}
}  // namespace

Status ZOR_CALL zoriFilterSobelHoriz_8u16s_C1R(const uint8_t* pSrc, int srcStep, int16_t* pDst,
                                               int dstStep, ImageSize roiSize, int mask) {
    return sobel8u16s(pSrc, srcStep, pDst, dstStep, roiSize, mask, Dir::Horiz);
}

Status ZOR_CALL zoriFilterSobelVert_8u16s_C1R(const uint8_t* pSrc, int srcStep, int16_t* pDst,
                                              int dstStep, ImageSize roiSize, int mask) {
    return sobel8u16s(pSrc, srcStep, pDst, dstStep, roiSize, mask, Dir::Vert);
}

// ---- border forms ---------------------------------------------------------------------

Status ZOR_CALL zoriFilterSobelHorizBorder_8u16s_C1R(const uint8_t* pSrc, int srcStep,
                                                     int16_t* pDst, int dstStep,
                                                     ImageSize roiSize, int mask, int borderType,
                                                     uint8_t borderValue, uint8_t* pBuffer) {
    return sobelBorder(pSrc, srcStep, pDst, dstStep, roiSize, mask, borderType, borderValue,
                       pBuffer, Dir::Horiz);
}

Status ZOR_CALL zoriFilterSobelVertBorder_8u16s_C1R(const uint8_t* pSrc, int srcStep,
                                                    int16_t* pDst, int dstStep,
                                                    ImageSize roiSize, int mask, int borderType,
                                                    uint8_t borderValue, uint8_t* pBuffer) {
    return sobelBorder(pSrc, srcStep, pDst, dstStep, roiSize, mask, borderType, borderValue,
                       pBuffer, Dir::Vert);
}

Status ZOR_CALL zoriFilterSobelHorizBorder_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                                   int dstStep, ImageSize roiSize, int mask,
                                                   int borderType, float borderValue,
                                                   uint8_t* pBuffer) {
    return sobelBorder(pSrc, srcStep, pDst, dstStep, roiSize, mask, borderType, borderValue,
                       pBuffer, Dir::Horiz);
}

Status ZOR_CALL zoriFilterSobelVertBorder_32f_C1R(const float* pSrc, int srcStep, float* pDst,
                                                  int dstStep, ImageSize roiSize, int mask,
                                                  int borderType, float borderValue,
                                                  uint8_t* pBuffer) {
    return sobelBorder(pSrc, srcStep, pDst, dstStep, roiSize, mask, borderType, borderValue,
                       pBuffer, Dir::Vert);
}

// ---- buffer sizes (one per data type; both directions share it) -----------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zoriFilterSobelHorizGetBufferSize_8u16s_C1R(ImageSize roiSize, int mask,
                                                            int* pBufferSize) {
    return sobelBufferSize(roiSize, mask, pBufferSize, false);
}
Status ZOR_CALL zoriFilterSobelVertGetBufferSize_8u16s_C1R(ImageSize roiSize, int mask,
                                                           int* pBufferSize) {
    return sobelBufferSize(roiSize, mask, pBufferSize, false);
}
Status ZOR_CALL zoriFilterSobelHorizGetBufferSize_32f_C1R(ImageSize roiSize, int mask,
                                                          int* pBufferSize) {
    return sobelBufferSize(roiSize, mask, pBufferSize, true);
}
Status ZOR_CALL zoriFilterSobelVertGetBufferSize_32f_C1R(ImageSize roiSize, int mask,
                                                         int* pBufferSize) {
    return sobelBufferSize(roiSize, mask, pBufferSize, true);
}
#endif

}}  // namespace zor::ZOR_NS
