// Range histograms: nLevels boundaries make nLevels - 1 bins, bin k counting
// the values v with levels[k] <= v < levels[k + 1].
//
// 8-bit images: a bin is (pixels below hi) - (pixels below lo) with its two
// levels clamped to 0..256, or 0 when lo >= hi.  The pixels below each
// boundary come from one of two counts:
//  - a full histogram of the 256 values, summed up.  Counting it is a
//    scatter, the same scalar loop in every variant; it runs in interleaved
//    copies (pixel i into copy i mod ways) so that equal neighbouring pixels
//    do not make each increment wait for the previous one.
//  - with SIMD, for a one-channel image whose levels have at most 8
//    distinct boundaries inside 1..255: a compare per boundary and register
//    of pixels, far cheaper than the scatter for so few boundaries.
// Both counts are exact, so every variant gives the same bins.
//
// Float images: a linear scan over the bins (binary search past 30 levels;
// with SIMD, up to 30 levels, a count of the levels below each pixel), or,
// when the levels are not strictly increasing, a test of every bin.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cstdint>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

constexpr int kValues = 256;
constexpr int kBinarySearchAbove = 30;  // levels

template <class T, class Level>
Status checkOneChannel(const T* src, int step, ImageSize roi, const int32_t* hist, const Level* levels, int nLevels) {
    return checkFirst(anyNull(src, hist, levels), badRoi(roi), badSteps(step),
                      nLevels < 2 ? StatusBadLevelCount : StatusOk);
}

[[maybe_unused]] int clampLevel(int32_t level) { return level < 0 ? 0 : level > kValues - 1 ? kValues : level; }

// Bins from below[b], the pixels under b, for the clamped levels.
[[maybe_unused]] void binsFromBelow(const uint32_t* below, int32_t* hist, const int32_t* levels, int nLevels) {
    for (int k = 0; k + 1 < nLevels; ++k) {
        const int lo = clampLevel(levels[k]), hi = clampLevel(levels[k + 1]);
        hist[k] = lo < hi ? int32_t(below[hi] - below[lo]) : 0;
    }
}

// Counts of every 8-bit value of each of Channels interleaved channels.
template <int Channels>
class FullHistogram {
public:
    void count(const uint8_t* src, int step, ImageSize roi) {
        std::memset(copy_, 0, sizeof copy_);
        for (int y = 0; y < roi.height; ++y) {
            const uint8_t* s = rowAt(src, step, y);
            int x = 0;
            for (; x + kWays <= roi.width; x += kWays)
                for (int k = 0; k < kWays; ++k)
                    for (int c = 0; c < Channels; ++c) ++copy_[c][k][s[Channels * (x + k) + c]];
            for (; x < roi.width; ++x)
                for (int c = 0; c < Channels; ++c) ++copy_[c][0][s[Channels * x + c]];
        }
    }
    // below[v], v = 0 .. 256, of channel c: the copies added, then summed up.
    void below(int c, uint32_t* below) const {
        alignas(64) uint32_t counts[kValues];
        int v = 0;
#if ZOR_SIMD >= 2
        using V = simd::Vec<uint32_t>;
        for (; v < kValues; v += V::kLanes) {
            V t = simd::loadAligned<V>(copy_[c][0] + v);
            for (int k = 1; k < kWays; ++k) t += simd::loadAligned<V>(copy_[c][k] + v);
            simd::storeAligned(counts + v, t);
        }
#endif
        for (; v < kValues; ++v) {
            counts[v] = copy_[c][0][v];
            for (int k = 1; k < kWays; ++k) counts[v] += copy_[c][k][v];
        }
        below[0] = 0;
        for (v = 0; v < kValues; ++v) below[v + 1] = below[v] + counts[v];
    }

private:
    static constexpr int kWays = Channels == 1 ? 4 : 2;  // copies per channel
    alignas(64) uint32_t copy_[Channels][kWays][kValues];
};

#if ZOR_SIMD >= 2
constexpr int kFewBoundaries = 8, kBoundariesAPass = 4;

// below[i] = the pixels under bounds[i] (1 .. 255), four boundaries a pass:
// a byte lane counts the registers whose pixel is under a boundary (a mask
// lane is -1) for up to 255 registers, then the counts go to 64-bit sums.
void countBelow(const uint8_t* src, int step, ImageSize roi, const int* bounds, uint32_t* below) {
    using V = simd::Vec<uint8_t>;
    using W = simd::Vec<uint64_t>;
    constexpr int L = V::kLanes, N = kBoundariesAPass;
    V top[N];
    W sum[N];
    for (int i = 0; i < N; ++i) {
        top[i] = simd::set1<V>(uint8_t(bounds[i] - 1));
        sum[i] = simd::zero<W>();
        below[i] = 0;
    }
    for (int y = 0; y < roi.height; ++y) {
        const uint8_t* s = rowAt(src, step, y);
        int x = 0;
        while (x + L <= roi.width) {
            V run[N];
            for (V& r : run) r = simd::zero<V>();
            for (int k = 0; k < 255 && x + L <= roi.width; ++k, x += L) {
                const V v = simd::load<V>(s + x);
                for (int i = 0; i < N; ++i) run[i] -= simd::le(v, top[i]);
            }
            for (int i = 0; i < N; ++i) sum[i] += simd::sumAbsDiff(run[i], simd::zero<V>());
        }
        for (; x < roi.width; ++x)
            for (int i = 0; i < N; ++i) below[i] += s[x] < bounds[i];
    }
    for (int i = 0; i < N; ++i) below[i] += uint32_t(simd::reduceAdd(sum[i]));
}

// The distinct clamped levels inside 1 .. 255, or -1 when there are more
// than kFewBoundaries.
int fewBoundaries(const int32_t* levels, int nLevels, int* bounds) {
    int n = 0;
    for (int k = 0; k < nLevels; ++k) {
        const int b = clampLevel(levels[k]);
        bool known = b == 0 || b == kValues;
        for (int i = 0; i < n && !known; ++i) known = bounds[i] == b;
        if (known) continue;
        if (n == kFewBoundaries) return -1;
        bounds[n++] = b;
    }
    return n;
}
#endif

// below[b] of a one-channel image for every b that the levels name.
[[maybe_unused]] void belowLevels(const uint8_t* src, int step, ImageSize roi, [[maybe_unused]] const int32_t* levels,
                                  [[maybe_unused]] int nLevels, uint32_t* below) {
#if ZOR_SIMD >= 2
    int bounds[kFewBoundaries];
    const int n = fewBoundaries(levels, nLevels, bounds);
    if (n >= 0) {
        for (int i = n; i < kFewBoundaries; ++i) bounds[i] = kValues - 1;  // padding: counted, not read
        for (int i = 0; i < n; i += kBoundariesAPass) {
            uint32_t count[kBoundariesAPass];
            countBelow(src, step, roi, bounds + i, count);
            for (int j = 0; j < kBoundariesAPass; ++j) below[bounds[i + j]] = count[j];
        }
        below[0] = 0;
        below[kValues] = uint32_t(roi.width) * uint32_t(roi.height);
        return;
    }
#endif
    FullHistogram<1> full;
    full.count(src, step, roi);
    full.below(0, below);
}

// ---- float levels --------------------------------------------------------------------

// The first bin k with v < levels[k + 1], for v inside the whole range.
[[maybe_unused]] int firstBinLinear(float v, const float* levels, int nLevels) {
    int k = 0;
    while (k + 2 < nLevels && !(v < levels[k + 1])) ++k;
    return k;
}

// The same bin by bisection: valid for strictly increasing levels.
[[maybe_unused]] int firstBinBisect(float v, const float* levels, int nLevels) {
    int lo = 0, hi = nLevels - 2;  // the bin is in lo .. hi
    while (lo < hi) {
        const int mid = lo + (hi - lo) / 2;
        if (v < levels[mid + 1]) hi = mid;
        else lo = mid + 1;
    }
    return lo;
}

#if ZOR_SIMD >= 2
// Strictly increasing levels without NaN: inside the range, the first bin k
// with v < levels[k + 1] is the number of levels[1 .. nLevels - 2] at or
// below v, which one compare a level finds for a register of pixels at once.
// Returns the columns it counted, a whole number of registers.
int countIncreasing32f(const float* s, int w, uint32_t* counts, const float* levels, int nLevels) {
    using F = simd::Vec<float>;
    using I = simd::Vec<int32_t>;
    constexpr int L = F::kLanes;
    const F first = simd::set1<F>(levels[0]), last = simd::set1<F>(levels[nLevels - 1]);
    int x = 0;
    for (; x + L <= w; x += L) {
        const F v = simd::load<F>(s + x);
        I bin = simd::zero<I>();
        for (int k = 1; k + 1 < nLevels; ++k) bin -= simd::bitcast<int32_t>(simd::ge(v, simd::set1<F>(levels[k])));
        const int inside = simd::laneMask(simd::ge(v, first) & simd::lt(v, last));
        alignas(64) int32_t b[L];
        simd::storeAligned(b, bin);
        for (int i = 0; i < L; ++i)
            if (inside >> i & 1) ++counts[b[i]];
    }
    return x;
}
#endif

[[maybe_unused]] void histogram32f(const float* src, int step, ImageSize roi, uint32_t* counts, const float* levels,
                                   int nLevels) {
    std::memset(counts, 0, sizeof(uint32_t) * size_t(nLevels - 1));
    bool increasing = true, ordered = true;
    for (int k = 0; k + 1 < nLevels; ++k) increasing = increasing && !(levels[k] >= levels[k + 1]);
    for (int k = 0; k < nLevels; ++k) ordered = ordered && levels[k] == levels[k];
    if (!increasing) {
        for (int y = 0; y < roi.height; ++y) {
            const float* s = rowAt(src, step, y);
            for (int x = 0; x < roi.width; ++x)
                for (int k = 0; k + 1 < nLevels; ++k) counts[k] += levels[k] <= s[x] && s[x] < levels[k + 1];
        }
        return;
    }
    // Increasing levels with a NaN among them are not sorted: neither the
    // bisection nor the count of levels below finds the first bin, so they
    // keep the linear scan.
    const bool bisect = ordered && nLevels > kBinarySearchAbove;
    const float first = levels[0], last = levels[nLevels - 1];
    for (int y = 0; y < roi.height; ++y) {
        const float* s = rowAt(src, step, y);
        int x = 0;
#if ZOR_SIMD >= 2
        if (ordered && !bisect) x = countIncreasing32f(s, roi.width, counts, levels, nLevels);
#endif
        for (; x < roi.width; ++x) {
            const float v = s[x];
            if (first <= v && v < last)
                ++counts[bisect ? firstBinBisect(v, levels, nLevels) : firstBinLinear(v, levels, nLevels)];
        }
    }
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zoriHistogramRange_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist,
                                          const int32_t* pLevels, int nLevels) {
    if (Status s = checkOneChannel(pSrc, srcStep, roiSize, pHist, pLevels, nLevels)) return s;
    uint32_t below[kValues + 1];
    belowLevels(pSrc, srcStep, roiSize, pLevels, nLevels, below);
    binsFromBelow(below, pHist, pLevels, nLevels);
    return StatusOk;
}

// Checks each channel's arguments before the size and the step.
Status ZOR_CALL zoriHistogramRange_8u_C3R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist[3],
                                          const int32_t* pLevels[3], const int nLevels[3]) {
    if (Status s = anyNull(pSrc, pHist, pLevels, nLevels)) return s;
    for (int c = 0; c < 3; ++c) {
        if (Status s = anyNull(pHist[c], pLevels[c])) return s;
        if (nLevels[c] < 2) return StatusBadLevelCount;
    }
    if (Status s = checkFirst(badRoi(roiSize), badSteps(srcStep))) return s;
    FullHistogram<3> full;
    full.count(pSrc, srcStep, roiSize);
    for (int c = 0; c < 3; ++c) {
        uint32_t below[kValues + 1];
        full.below(c, below);
        binsFromBelow(below, pHist[c], pLevels[c], nLevels[c]);
    }
    return StatusOk;
}

Status ZOR_CALL zoriHistogramRange_32f_C1R(const float* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist,
                                           const float* pLevels, int nLevels) {
    if (Status s = checkOneChannel(pSrc, srcStep, roiSize, pHist, pLevels, nLevels)) return s;
    // counted as unsigned, which may alias the caller's signed counts
    histogram32f(pSrc, srcStep, roiSize, reinterpret_cast<uint32_t*>(pHist), pLevels, nLevels);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
