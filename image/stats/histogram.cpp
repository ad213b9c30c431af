// Range histograms: nLevels boundaries make nLevels - 1 bins, bin k counting
// the values v with levels[k] <= v < levels[k + 1].
//
// 8-bit images: one full 256-value histogram per channel, then each bin is
// the sum of the full counts over its clamped level range, taken as the
// difference of two prefix sums.  The full histogram is counted in several
// interleaved copies (pixel i into copy i mod ways) so that equal
// neighbouring pixels do not make each increment wait for the previous one;
// the copies are added at the end, in registers where the variant has them.
// Counting is a scatter, which 16-byte registers cannot do; it is the same
// scalar loop in every variant.
//
// Float images: a linear scan over the bins (binary search past 30 levels),
// or, when the levels are not strictly increasing, a test of every bin.
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

// Counts of every 8-bit value of each of Channels interleaved channels.
template <int Channels>
struct FullHistogram {
    static constexpr int kWays = Channels == 1 ? 4 : 2;  // copies per channel
    alignas(64) uint32_t copy[Channels][kWays][kValues];
    alignas(64) uint32_t total[Channels][kValues];

    void count(const uint8_t* src, int step, ImageSize roi);
    void addCopies();
};

template <int Channels>
void FullHistogram<Channels>::count(const uint8_t* src, int step, ImageSize roi) {
    std::memset(copy, 0, sizeof copy);
    for (int y = 0; y < roi.height; ++y) {
        const uint8_t* s = rowAt(src, step, y);
        int x = 0;
        for (; x + kWays <= roi.width; x += kWays)
            for (int k = 0; k < kWays; ++k)
                for (int c = 0; c < Channels; ++c) ++copy[c][k][s[Channels * (x + k) + c]];
        for (; x < roi.width; ++x)
            for (int c = 0; c < Channels; ++c) ++copy[c][0][s[Channels * x + c]];
    }
    addCopies();
}

template <int Channels>
void FullHistogram<Channels>::addCopies() {
    for (int c = 0; c < Channels; ++c) {
        int i = 0;
#if ZOR_SIMD >= 2
        using V = simd::Vec<uint32_t>;
        for (; i < kValues; i += V::kLanes) {
            V t = simd::loadAligned<V>(copy[c][0] + i);
            for (int k = 1; k < kWays; ++k) t += simd::loadAligned<V>(copy[c][k] + i);
            simd::storeAligned(total[c] + i, t);
        }
#endif
        for (; i < kValues; ++i) {
            uint32_t t = copy[c][0][i];
            for (int k = 1; k < kWays; ++k) t += copy[c][k][i];
            total[c][i] = t;
        }
    }
}

// Bins of an 8-bit channel from its full counts: levels clamped to 0..256,
// a bin with lo >= hi counts 0.
[[maybe_unused]] void binsFromCounts(const uint32_t* counts, int32_t* hist, const int32_t* levels, int nLevels) {
    uint32_t below[kValues + 1];  // below[v]: pixels with a value under v
    below[0] = 0;
    for (int v = 0; v < kValues; ++v) below[v + 1] = below[v] + counts[v];
    auto clamp = [](int32_t level) { return level < 0 ? 0 : level > kValues - 1 ? kValues : level; };
    for (int k = 0; k + 1 < nLevels; ++k) {
        const int lo = clamp(levels[k]), hi = clamp(levels[k + 1]);
        hist[k] = lo < hi ? int32_t(below[hi] - below[lo]) : 0;
    }
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

[[maybe_unused]] void histogram32f(const float* src, int step, ImageSize roi, uint32_t* counts, const float* levels, int nLevels) {
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
    // Increasing levels with a NaN among them are not sorted: bisection would
    // not find the first bin, so they keep the linear scan.
    auto firstBin = ordered && nLevels > kBinarySearchAbove ? firstBinBisect : firstBinLinear;
    const float first = levels[0], last = levels[nLevels - 1];
    for (int y = 0; y < roi.height; ++y) {
        const float* s = rowAt(src, step, y);
        for (int x = 0; x < roi.width; ++x) {
            const float v = s[x];
            if (first <= v && v < last) ++counts[firstBin(v, levels, nLevels)];
        }
    }
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zoriHistogramRange_8u_C1R(const uint8_t* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist,
                                          const int32_t* pLevels, int nLevels) {
    if (Status s = checkFirst(anyNull(pSrc, pHist, pLevels), badRoi(roiSize), badSteps(srcStep),
                              nLevels < 2 ? StatusBadLevelCount : StatusOk))
        return s;
    FullHistogram<1> full;
    full.count(pSrc, srcStep, roiSize);
    binsFromCounts(full.total[0], pHist, pLevels, nLevels);
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
    for (int c = 0; c < 3; ++c) binsFromCounts(full.total[c], pHist[c], pLevels[c], nLevels[c]);
    return StatusOk;
}
#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zoriHistogramRange_32f_C1R(const float* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist,
                                           const float* pLevels, int nLevels) {
    if (Status s = checkFirst(anyNull(pSrc, pHist, pLevels), badRoi(roiSize), badSteps(srcStep),
                              nLevels < 2 ? StatusBadLevelCount : StatusOk))
        return s;
    // counted as unsigned, which may alias the caller's signed counts
    histogram32f(pSrc, srcStep, roiSize, reinterpret_cast<uint32_t*>(pHist), pLevels, nLevels);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
