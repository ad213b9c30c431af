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
// Tie rules, deliberately asymmetric: along horizontal and vertical
// gradients a pixel must beat the neighbour before it and only match the one
// after it (a plateau keeps its left or upper pixel); along diagonals it must
// beat both.
#include "frame/variant.h"
#include "frame/rows.h"
#include "frame/status.h"

#include <climits>
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
    const int64_t bytes = (wideCoordinates(roi) ? 9 : 5) * padded + 16 * static_cast<int64_t>(roi.width) + 160;
    if (bytes > INT_MAX) return StatusBadSize;  // not expressible as an int
    *size = static_cast<int>(bytes);
    return StatusOk;
}

inline uint8_t* alignUp(uint8_t* p, size_t a) {
    return reinterpret_cast<uint8_t*>((reinterpret_cast<uintptr_t>(p) + a - 1) & ~(uintptr_t(a) - 1));
}

// Magnitudes of one ROI row into m[0 .. w-1] (the frame elements stay 0).
void magnitudeRow(const int16_t* dx, const int16_t* dy, int32_t* m, int w, int low) {
    int x = 0;
#if ZOR_SIMD >= 2
    const __m128i zero = _mm_setzero_si128();
    const __m128i lowV = _mm_set1_epi32(low);
    for (; x + 8 <= w; x += 8) {
        const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dx + x));
        const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(dy + x));
#  if ZOR_SIMD >= 4
        // |v| fits 16 unsigned bits (|-32768| = 0x8000): zero-extend it
        const __m128i aa = _mm_abs_epi16(a), ab = _mm_abs_epi16(b);
        __m128i lo = _mm_add_epi32(_mm_unpacklo_epi16(aa, zero), _mm_unpacklo_epi16(ab, zero));
        __m128i hi = _mm_add_epi32(_mm_unpackhi_epi16(aa, zero), _mm_unpackhi_epi16(ab, zero));
#  else
        // |v| as 32-bit: sign-extend, then (v ^ s) - s
        const __m128i sa = _mm_srai_epi16(a, 15), sb = _mm_srai_epi16(b, 15);
        const __m128i alo = _mm_unpacklo_epi16(a, sa), ahi = _mm_unpackhi_epi16(a, sa);
        const __m128i blo = _mm_unpacklo_epi16(b, sb), bhi = _mm_unpackhi_epi16(b, sb);
        auto absv = [](__m128i v) {
            const __m128i s = _mm_srai_epi32(v, 31);
            return _mm_sub_epi32(_mm_xor_si128(v, s), s);
        };
        __m128i lo = _mm_add_epi32(absv(alo), absv(blo));
        __m128i hi = _mm_add_epi32(absv(ahi), absv(bhi));
#  endif
        lo = _mm_and_si128(lo, _mm_cmpgt_epi32(lo, lowV));
        hi = _mm_and_si128(hi, _mm_cmpgt_epi32(hi, lowV));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(m + x), lo);
        _mm_storeu_si128(reinterpret_cast<__m128i*>(m + x + 4), hi);
    }
#endif
    for (; x < w; ++x) {
        const int32_t v = (dx[x] < 0 ? -int32_t(dx[x]) : dx[x]) + (dy[x] < 0 ? -int32_t(dy[x]) : dy[x]);
        m[x] = v > low ? v : 0;
    }
}

template <class Coord>
class EdgeStack {
public:
    explicit EdgeStack(uint8_t* base) : base_(reinterpret_cast<Coord*>(base)), top_(base_) {}
    void push(ptrdiff_t row, ptrdiff_t col) {
        top_[0] = static_cast<Coord>(row);
        top_[1] = static_cast<Coord>(col);
        top_ += 2;
    }
    bool pop(ptrdiff_t& row, ptrdiff_t& col) {
        if (top_ == base_) return false;
        top_ -= 2;
        row = top_[0];
        col = top_[1];
        return true;
    }

private:
    Coord* base_;
    Coord* top_;
};

template <class Coord>
void detect(const int16_t* dx, int dxStep, const int16_t* dy, int dyStep, uint8_t* dst, int dstStep,
            ImageSize roi, int low, float high, uint8_t* buffer) {
    const int w = roi.width, h = roi.height;
    const size_t pw = size_t(w) + 2;  // padded width
    // buffer: three magnitude rows, the candidate map, the stack
    int32_t* ringBase = reinterpret_cast<int32_t*>(alignUp(buffer, 16));
    int32_t* mag[3] = {ringBase, ringBase + pw, ringBase + 2 * pw};
    uint8_t* map = reinterpret_cast<uint8_t*>(ringBase + 3 * pw);
    const size_t mapBytes = pw * (size_t(h) + 2);
    EdgeStack<Coord> stack(alignUp(map + mapBytes, sizeof(Coord) * 2));

    std::memset(map, 0, mapBytes);
    std::memset(mag[0], 0, 3 * pw * sizeof(int32_t));

    constexpr double kTan22 = 0.41421356237309503;
    constexpr double kTan67 = 2.414213562373095;
    // Magnitude row r of the ROI lives in mag[(r + 1) % 3] + 1 once computed;
    // row -1 (all 0) starts in mag[0].
    auto magRow = [&](ptrdiff_t r) { return mag[(r + 1) % 3] + 1; };
    magnitudeRow(dx, dy, magRow(0), w, low);
    for (ptrdiff_t r = 0; r < h; ++r) {
        int32_t* below = magRow(r + 1);
        if (r + 1 < h)
            magnitudeRow(rowAt(dx, dxStep, r + 1), rowAt(dy, dyStep, r + 1), below, w, low);
        else
            std::memset(below - 1, 0, pw * sizeof(int32_t));
        const int32_t* above = magRow(r - 1);
        const int32_t* cur = magRow(r);
        const int16_t* dxr = rowAt(dx, dxStep, r);
        const int16_t* dyr = rowAt(dy, dyStep, r);
        uint8_t* mapRow = map + size_t(r + 1) * pw + 1;
        uint8_t* dstRow = rowAt(dst, dstStep, r);
        for (int x = 0; x < w; ++x) {
#if ZOR_SIMD >= 2
            // most magnitudes are cleared by the low threshold: skip 16 zeros at once
            if ((x & 15) == 0 && x + 16 <= w) {
                const __m128i* q = reinterpret_cast<const __m128i*>(cur + x);
                const __m128i any = _mm_or_si128(_mm_or_si128(_mm_loadu_si128(q), _mm_loadu_si128(q + 1)),
                                                 _mm_or_si128(_mm_loadu_si128(q + 2), _mm_loadu_si128(q + 3)));
                if (_mm_movemask_epi8(_mm_cmpeq_epi32(any, _mm_setzero_si128())) == 0xFFFF) {
                    x += 15;
                    continue;
                }
            }
#endif
            const int32_t m = cur[x];
            if (m <= 0) continue;
            const int32_t gx = dxr[x], gy = dyr[x];
            const int32_t ax = gx < 0 ? -gx : gx, ay = gy < 0 ? -gy : gy;
            bool keep;
            if (static_cast<double>(ay) < kTan22 * static_cast<double>(ax)) {
                keep = m > cur[x - 1] && m >= cur[x + 1];                  // left, right
            } else if (static_cast<double>(ay) <= kTan67 * static_cast<double>(ax)) {
                if ((gx ^ gy) < 0)
                    keep = m > above[x + 1] && m > below[x - 1];           // upper right, lower left
                else
                    keep = m > above[x - 1] && m > below[x + 1];           // upper left, lower right
            } else {
                keep = m > above[x] && m >= below[x];                      // up, down
            }
            if (!keep) continue;
            mapRow[x] = 128;
            if (static_cast<float>(m) > high) {
                dstRow[x] = 255;
                stack.push(r, x);
            }
        }
    }

    // Grow the edges: neighbours in the order upper left, up, upper right,
    // left, right, lower left, down, lower right.
    static const int kDy[8] = {-1, -1, -1, 0, 0, 1, 1, 1};
    static const int kDx[8] = {-1, 0, 1, -1, 1, -1, 0, 1};
    ptrdiff_t r, c;
    while (stack.pop(r, c)) {
        for (int k = 0; k < 8; ++k) {
            const ptrdiff_t nr = r + kDy[k], nc = c + kDx[k];
            if (map[size_t(nr + 1) * pw + size_t(nc + 1)] < 128) continue;  // the frame is 0
            uint8_t* d = rowAt(dst, dstStep, nr) + nc;
            if (*d != 0) continue;
            *d = 255;
            stack.push(nr, nc);
        }
    }
}

}  // namespace

#if ZOR_VARIANT == 0
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
