// Rank filters: median (odd masks), maximum and minimum (any mask) over the
// neighbourhood of columns x - ax .. x - ax + mW - 1 and rows
// y - ay .. y - ay + mH - 1 (no flipping).  The caller supplies every source
// pixel the neighbourhood touches.
//
// The median of N = mW * mH values is the one of rank (N >> 1) + 1 from the
// smallest.  8u: a 1x1 mask copies; 3x3 (from sorted columns) and 5x5 (a
// pruned sorting network) have vectorised paths; every other mask uses a
// sliding 256-bin histogram.  16s:
// each neighbourhood is gathered and the middle element selected.
//
// Maximum and minimum are separable: a row pass over the mW values of each
// neighbourhood row into a ring of mH rows, then a column pass over the ring.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/memory.h"
#include "frame/status.h"
#include "image/filter/extreme3x3.h"

#include <algorithm>
#include <cstddef>
#include <cstring>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

Status checkRank(const void* src, int srcStep, const void* dst, int dstStep, ImageSize roi,
                 ImageSize mask, ImagePoint anchor, bool oddOnly) {
    if (Status s = checkFirst(anyNull(src, dst), badRoi(roi), badSteps(srcStep, dstStep)))
        return s;
    if (mask.width < 1 || mask.height < 1) return StatusBadMaskSize;
    if (oddOnly && ((mask.width & 1) == 0 || (mask.height & 1) == 0)) return StatusBadMaskSize;
    if (anchor.x < 0 || anchor.x >= mask.width || anchor.y < 0 || anchor.y >= mask.height)
        return StatusBadAnchor;
    return StatusOk;
}

template <class T>
void copyRoi(const T* src, int srcStep, T* dst, int dstStep, ImageSize roi) {
    for (int y = 0; y < roi.height; ++y)
        std::memcpy(rowAt(dst, dstStep, y), rowAt(src, srcStep, y), sizeof(T) * size_t(roi.width));
}

// ---- median: sliding histogram (8u) ------------------------------------------------------

// top points at the neighbourhood's top-left pixel of output (0, y).
void medianRowHistogram(const uint8_t* top, int srcStep, uint8_t* dst, int w, ImageSize mask) {
    const int rank = (mask.width * mask.height >> 1) + 1;
    int hist[256] = {};
    for (int r = 0; r < mask.height; ++r) {
        const uint8_t* p = rowAt(top, srcStep, r);
        for (int i = 0; i < mask.width; ++i) ++hist[p[i]];
    }
    int m = 0, below = hist[0];  // below: count of values <= m
    while (below < rank) below += hist[++m];
    dst[0] = static_cast<uint8_t>(m);
    for (int x = 1; x < w; ++x) {
        for (int r = 0; r < mask.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const int out = p[-1], in = p[mask.width - 1];
            --hist[out];
            ++hist[in];
            below += (in <= m) - (out <= m);
        }
        while (below < rank) below += hist[++m];
        while (below - hist[m] >= rank) below -= hist[m--];
        dst[x] = static_cast<uint8_t>(m);
    }
}

// ---- median: 3x3 from sorted columns ---------------------------------------------------

#if ZOR_SIMD >= 2
using Pixels = simd::Vec<uint8_t>;  // a register of 8-bit pixels

template <class V>
inline void sort2(V& a, V& b) {
    const V t = a;
    a = simd::min(t, b);
    b = simd::max(t, b);
}
template <class V>
inline V median3(V a, V b, V c) {
    using simd::max;
    using simd::min;
    return max(min(a, b), min(max(a, b), c));
}

// The median of nine is the median of (largest of the column minima, median
// of the column medians, smallest of the column maxima).
template <class V>
struct SortedColumns {
    V lo, mid, hi;
};
template <class V>
inline SortedColumns<V> sortColumns(const uint8_t* r0, const uint8_t* r1, const uint8_t* r2) {
    using simd::load;
    V a = load<V>(r0), b = load<V>(r1), c = load<V>(r2);
    sort2(a, b);
    sort2(b, c);
    sort2(a, b);
    return {a, b, c};
}
template <class V>
inline V median9(const SortedColumns<V> (&c)[3]) {
    using simd::max;
    using simd::min;
    const V maxLo = max(max(c[0].lo, c[1].lo), c[2].lo);
    const V minHi = min(min(c[0].hi, c[1].hi), c[2].hi);
    return median3(maxLo, median3(c[0].mid, c[1].mid, c[2].mid), minHi);
}
inline Pixels median3x3(const uint8_t* r0, const uint8_t* r1, const uint8_t* r2) {
    const SortedColumns<Pixels> c[3] = {sortColumns<Pixels>(r0, r1, r2), sortColumns<Pixels>(r0 + 1, r1 + 1, r2 + 1),
                                        sortColumns<Pixels>(r0 + 2, r1 + 2, r2 + 2)};
    return median9(c);
}

// Rows of a register's width or more; the last block overlaps the one
// before.
void median3x3Rows(const uint8_t* top, int srcStep, uint8_t* dst, int dstStep, ImageSize roi) {
    using namespace simd;
    const int w = roi.width;
    for (int y = 0; y < roi.height; ++y) {
        const uint8_t* r0 = rowAt(top, srcStep, y);
        const uint8_t* r1 = rowAt(r0, srcStep, 1);
        const uint8_t* r2 = rowAt(r0, srcStep, 2);
        uint8_t* d = rowAt(dst, dstStep, y);
        int x = 0;
#  if ZOR_SIMD >= 4
        // each block's columns sorted once; the shifted ones come from the
        // next block (the shifts reach across one 16-byte register)
        using B = Vec<uint8_t, 16>;
        if (w >= 32) {
            SortedColumns<B> cur = sortColumns<B>(r0, r1, r2);
            for (; x + 32 <= w + 2; x += 16) {  // reads up to column x + 31
                const SortedColumns<B> next = sortColumns<B>(r0 + x + 16, r1 + x + 16, r2 + x + 16);
                const SortedColumns<B> c[3] = {
                    cur,
                    {alignBytes<1>(next.lo, cur.lo), alignBytes<1>(next.mid, cur.mid), alignBytes<1>(next.hi, cur.hi)},
                    {alignBytes<2>(next.lo, cur.lo), alignBytes<2>(next.mid, cur.mid), alignBytes<2>(next.hi, cur.hi)}};
                store(d + x, median9(c));
                cur = next;
            }
        }
#  endif
        for (; x < w; x += Pixels::kLanes) {
            if (x + Pixels::kLanes > w) x = w - Pixels::kLanes;
            store(d + x, median3x3(r0 + x, r1 + x, r2 + x));
        }
    }
}

// The median of 25: a sorting network (odd-even merge sort) pruned to the
// comparisons that reach the middle output; MN/MX keep one side only.
inline Pixels median5x5(const uint8_t* r0, int step) {
    using namespace simd;
    Pixels v[25];
    for (int j = 0; j < 5; ++j)
        for (int i = 0; i < 5; ++i) v[j * 5 + i] = load<Pixels>(rowAt(r0, step, j) + i);
#define S(a, b) sort2(v[a], v[b]);
#define MN(a, b) v[a] = min(v[a], v[b]);
#define MX(a, b) v[b] = max(v[a], v[b]);
        S(0,1); S(2,3); S(4,5); S(6,7); S(8,9); S(10,11); S(12,13); S(14,15); S(16,17); S(18,19);
        S(20,21); S(22,23); S(0,2); S(1,3); S(4,6); S(5,7); S(8,10); S(9,11); S(12,14); S(13,15);
        S(16,18); S(17,19); S(20,22); S(21,23); S(1,2); S(5,6); S(9,10); S(13,14); S(17,18);
        S(21,22); S(0,4); S(1,5); S(2,6); S(3,7); S(8,12); S(9,13); S(10,14); S(11,15); S(16,20);
        S(17,21); S(18,22); S(19,23); S(2,4); S(3,5); S(10,12); S(11,13); S(18,20); S(19,21);
        S(1,2); S(3,4); S(5,6); S(9,10); S(11,12); S(13,14); S(17,18); S(19,20); S(21,22); S(0,8);
        S(1,9); S(2,10); S(3,11); S(4,12); S(5,13); S(6,14); MN(7,15); S(16,24); S(4,8); S(5,9);
        S(6,10); S(7,11); S(20,24); S(2,4); S(3,5); S(6,8); S(7,9); S(10,12); S(11,13); S(18,20);
        S(19,21); S(22,24); S(1,2); S(3,4); S(5,6); S(7,8); S(9,10); S(11,12); MN(13,14); S(17,18);
        S(19,20); S(21,22); S(23,24); MX(0,16); MX(1,17); MX(2,18); MX(3,19); MX(4,20); MX(5,21);
        MN(6,22); MN(7,23); MN(8,24); MX(8,16); MX(9,17); MN(10,18); MN(11,19); MN(12,20);
        MN(13,21); MX(6,10); MX(7,11); MN(12,16); MN(13,17); MX(10,12); MN(11,13); MX(11,12);
#undef S
#undef MN
#undef MX
    return v[12];
}

void median5x5Rows(const uint8_t* top, int srcStep, uint8_t* dst, int dstStep, ImageSize roi) {
    constexpr int L = Pixels::kLanes;
    for (int y = 0; y < roi.height; ++y) {
        const uint8_t* r0 = rowAt(top, srcStep, y);
        uint8_t* d = rowAt(dst, dstStep, y);
        for (int x0 = 0; x0 < roi.width; x0 += L) {
            const int x = x0 + L <= roi.width ? x0 : roi.width - L;
            simd::store(d + x, median5x5(r0 + x, srcStep));
        }
    }
}
#endif

// ---- median: gathered neighbourhoods (16s) ----------------------------------------------

// The k-th smallest of v[0 .. n-1] (v is reordered).  A local quickselect
// rather than std::nth_element: a standard-library instantiation would be a
// weak symbol shared by every variant's copy of this file.
template <class T>
T selectNth(T* v, size_t n, size_t k) {
    size_t lo = 0, hi = n - 1;
    while (lo < hi) {
        const T pivot = v[lo + (hi - lo) / 2];
        size_t i = lo, j = hi;
        while (i <= j) {
            while (v[i] < pivot) ++i;
            while (pivot < v[j]) --j;
            if (i <= j) {
                const T t = v[i];
                v[i] = v[j];
                v[j] = t;
                ++i;
                if (j == 0) break;
                --j;
            }
        }
        if (k <= j) hi = j;
        else if (k >= i) lo = i;
        else return v[k];
    }
    return v[k];
}

template <class T>
Status medianGather(const T* top, int srcStep, T* dst, int dstStep, ImageSize roi, ImageSize mask) {
    const size_t n = size_t(mask.width) * size_t(mask.height);
    if (n * sizeof(T) > 0xFFFFFF00u) return StatusNoMemory;
    T* v = static_cast<T*>(mem::alignedAlloc(static_cast<uint32_t>(n * sizeof(T))));
    if (!v) return StatusNoMemory;
    for (int y = 0; y < roi.height; ++y) {
        const T* t = rowAt(top, srcStep, y);
        T* d = rowAt(dst, dstStep, y);
        for (int x = 0; x < roi.width; ++x) {
            size_t k = 0;
            for (int r = 0; r < mask.height; ++r) {
                const T* p = rowAt(t, srcStep, r) + x;
                for (int i = 0; i < mask.width; ++i) v[k++] = p[i];
            }
            d[x] = selectNth(v, n, n >> 1);
        }
    }
    mem::alignedFree(v);
    return StatusOk;
}

// ---- maximum and minimum -------------------------------------------------------------

// Op: PickMax or PickMin (image/filter/extreme3x3.h).
// out[x] = pick of p[x .. x + n - 1]
template <class Op>
void pickRow(const uint8_t* p, uint8_t* out, int w, int n) {
    int x = 0;
#if ZOR_SIMD >= 2
    using simd::load;
    for (; x + Pixels::kLanes <= w; x += Pixels::kLanes) {
        Pixels a = load<Pixels>(p + x);
        for (int i = 1; i < n; ++i) a = Op::pick(a, load<Pixels>(p + x + i));
        simd::store(out + x, a);
    }
#endif
    for (; x < w; ++x) {
        uint8_t a = p[x];
        for (int i = 1; i < n; ++i) a = Op::pick(a, p[x + i]);
        out[x] = a;
    }
}

// out[x] = pick of rows[0..n-1][x]
template <class Op>
void pickColumn(uint8_t* const* rows, uint8_t* out, int w, int n) {
    int x = 0;
#if ZOR_SIMD >= 2
    using simd::load;
    for (; x + Pixels::kLanes <= w; x += Pixels::kLanes) {
        Pixels a = load<Pixels>(rows[0] + x);
        for (int j = 1; j < n; ++j) a = Op::pick(a, load<Pixels>(rows[j] + x));
        simd::store(out + x, a);
    }
#endif
    for (; x < w; ++x) {
        uint8_t a = rows[0][x];
        for (int j = 1; j < n; ++j) a = Op::pick(a, rows[j][x]);
        out[x] = a;
    }
}

template <class Op>
Status rankExtreme(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi,
                   ImageSize mask, ImagePoint anchor) {
    if (Status s = checkRank(src, srcStep, dst, dstStep, roi, mask, anchor, false)) return s;
    if (mask.width == 1 && mask.height == 1) {
        copyRoi(src, srcStep, dst, dstStep, roi);
        return StatusOk;
    }
    const uint8_t* top = rowAt(src, srcStep, -anchor.y) - anchor.x;
    if (mask.width == 3 && mask.height == 3) {  // direct, no ring needed
        for (int y = 0; y < roi.height; ++y)
            extreme3x3Row<Op>(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), roi.width);
        return StatusOk;
    }
    const size_t stride = (size_t(roi.width) + 31) & ~size_t(31);
    const uint64_t bytes = uint64_t(stride) * uint64_t(mask.height);
    const uint64_t ptrBytes = uint64_t(mask.height) * sizeof(uint8_t*);
    if (bytes > 0x7FFFFFFFu || ptrBytes > 0x7FFFFFFFu) return StatusNoMemory;
    uint8_t* ring = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(bytes)));
    if (!ring) return StatusNoMemory;
    uint8_t** rows = static_cast<uint8_t**>(mem::alignedAlloc(static_cast<uint32_t>(ptrBytes)));
    if (!rows) {
        mem::alignedFree(ring);
        return StatusNoMemory;
    }
    const int mH = mask.height;
    // ring slot of source row v (relative to the top of output row 0)
    auto slot = [&](int v) { return ring + size_t(v % mH) * stride; };
    for (int v = 0; v < mH - 1; ++v) pickRow<Op>(rowAt(top, srcStep, v), slot(v), roi.width, mask.width);
    for (int y = 0; y < roi.height; ++y) {
        const int v = y + mH - 1;
        pickRow<Op>(rowAt(top, srcStep, v), slot(v), roi.width, mask.width);
        for (int j = 0; j < mH; ++j) rows[j] = slot(y + j);
        pickColumn<Op>(rows, rowAt(dst, dstStep, y), roi.width, mH);
    }
    mem::alignedFree(rows);
    mem::alignedFree(ring);
    return StatusOk;
}

// The median proper, from the neighbourhood's top-left source sample.
Status medianFrom(const uint8_t* top, int srcStep, uint8_t* pDst, int dstStep, ImageSize roi, ImageSize mask) {
#if ZOR_SIMD >= 2
    if (mask.width == 3 && mask.height == 3 && roi.width >= Pixels::kLanes) {
        median3x3Rows(top, srcStep, pDst, dstStep, roi);
        return StatusOk;
    }
    if (mask.width == 5 && mask.height == 5 && roi.width >= Pixels::kLanes) {
        median5x5Rows(top, srcStep, pDst, dstStep, roi);
        return StatusOk;
    }
#endif
    for (int y = 0; y < roi.height; ++y)
        medianRowHistogram(rowAt(top, srcStep, y), srcStep, rowAt(pDst, dstStep, y), roi.width, mask);
    return StatusOk;
}
Status medianFrom(const int16_t* top, int srcStep, int16_t* pDst, int dstStep, ImageSize roi, ImageSize mask) {
    return medianGather(top, srcStep, pDst, dstStep, roi, mask);
}

template <class T>
Status median(const T* pSrc, int srcStep, T* pDst, int dstStep, ImageSize roi, ImageSize mask,
              ImagePoint anchor) {
    if (Status s = checkRank(pSrc, srcStep, pDst, dstStep, roi, mask, anchor, true)) return s;
    if (mask.width == 1 && mask.height == 1) {
        copyRoi(pSrc, srcStep, pDst, dstStep, roi);
        return StatusOk;
    }
    return medianFrom(rowAt(pSrc, srcStep, -anchor.y) - anchor.x, srcStep, pDst, dstStep, roi, mask);
}

}  // namespace

Status ZOR_CALL zoriFilterMedian_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst,
                                        int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
                                        ImagePoint anchor) {
    return median(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor);
}

Status ZOR_CALL zoriFilterMedian_16s_C1R(const int16_t* pSrc, int srcStep, int16_t* pDst,
                                         int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
                                         ImagePoint anchor) {
    return median(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor);
}

Status ZOR_CALL zoriFilterMax_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor) {
    return rankExtreme<PickMax>(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor);
}

Status ZOR_CALL zoriFilterMin_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor) {
    return rankExtreme<PickMin>(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor);
}

}}  // namespace zor::ZOR_NS
