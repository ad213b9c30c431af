// Speech front-end helpers: pre-emphasis, padded copy, cosine transform
// with lifter, energy normalisation, sign-change rate and the forward
// autocorrelation peak search.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/memory.h"

#include <climits>
#include <cmath>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

struct DctLifter {
    int32_t nLifter;
    int32_t lenDCT;
    int32_t lenCeps;
    int32_t withC0;   // always 0 from the init function here
    float* lifter;    // lenCeps + 1 weights
    float* dct;       // lenCeps + 1 rows of lenDCT cosines
    // The rows 1 .. lenCeps again, as doubles and side by side in pairs
    // (row 2p + 1 and row 2p + 2 alternating along j, the last pair padded
    // with zeros): the vector sums then load two coefficients' terms at once.
    double* pairs;
};

inline int64_t pairCount(int64_t lenCeps) { return (lenCeps + 1) / 2; }

}  // namespace

// x[n] -= val x[n-1] from the end, so every step sees the original x[n-1].
// In double, rounded once; the SSE2 path does the same four at a time.
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zorsPreemphasize_32f(float* pSrcDst, int len, float val) {
    if (!pSrcDst) return StatusNullPointer;
    if (len < 1) return StatusBadSize;
    DoublePrecisionScope precision;
    float* x = pSrcDst;
    const double v = val;
    int n = len - 1;
#if ZOR_SIMD >= 2
    // blocks of four as two 16-byte registers of doubles
    using namespace simd;
    using F4 = Vec<float, 16>;
    using D2 = Vec<double, 16>;
    const D2 vv = set1<D2>(v);
    // Blocks of four from the top, each value converted once: a block's
    // lowest predecessor comes from the block below it, which is loaded
    // and converted one step ahead (before this block is stored).
    if (n >= 7) {
        D2 lo = loadWidened<D2>(x + n - 3), hi = loadWidened<D2>(x + n - 1);
        for (; n >= 7; n -= 4) {
            const D2 belowLo = loadWidened<D2>(x + n - 7), belowHi = loadWidened<D2>(x + n - 5);
            // the predecessors: one lane down
            const D2 prevLo = alignBytes<8>(lo, belowHi), prevHi = alignBytes<8>(hi, lo);
            store(x + n - 3, narrowSat<float>(lo - vv * prevLo, hi - vv * prevHi));
            lo = belowLo;
            hi = belowHi;
        }
    }
    for (; n >= 4; n -= 4) {
        const F4 cur = load<F4>(x + n - 3), prev = load<F4>(x + n - 4);
        store(x + n - 3, narrowSat<float>(widenLo(cur) - vv * widenLo(prev), widenHi(cur) - vv * widenHi(prev)));
    }
#endif
    for (; n >= 1; --n) x[n] = toFloat(double(x[n]) - v * double(x[n - 1]));
    return StatusOk;
}
#endif

#if ZOR_SIMD >= 2
// G pairs of rows (w: G blocks of n pairs) times x, into sums[0 .. 2G-1].
// (The pairs table holds two coefficients' terms per 16-byte register.)
template <int G>
inline void pairSums(const double* w, const float* x, int n, double* sums) {
    using namespace simd;
    using D2 = Vec<double, 16>;
    D2 acc[G];
    for (int q = 0; q < G; ++q) acc[q] = zero<D2>();
    for (int j = 0; j < n; ++j) {
        const D2 v = set1<D2>(double(x[j]));
        for (int q = 0; q < G; ++q) acc[q] = acc[q] + loadAligned<D2>(w + (int64_t(q) * n + j) * 2) * v;
    }
    for (int q = 0; q < G; ++q) store(sums + 2 * q, acc[q]);
}
#endif

// Cosine transform with lifter.  Each coefficient's sum runs in increasing
// j (the products of two floats are exact in double); the SSE2 path runs
// two coefficients per register and up to eight side by side.
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
Status ZOR_CALL zorsDCTLifter_32f(const float* pSrc, float* pDst, const void* pDCTLifter) {
    if (Status s = anyNull(pSrc, pDst, pDCTLifter)) return s;
    const DctLifter* d = static_cast<const DctLifter*>(pDCTLifter);
    DoublePrecisionScope precision;
    const int n = d->lenDCT;
    auto finish = [&](int i, double sum) { pDst[i - 1] = toFloat(sum * double(d->lifter[i])); };
    auto coefficient = [&](int k) {
        const float* r = d->dct + int64_t(k) * n;
        double acc = 0.0;
        for (int j = 0; j < n; ++j) acc = toDouble(acc + double(r[j]) * double(pSrc[j]));
        return acc;
    };
    int i = 1;
#if ZOR_SIMD >= 2
    // Groups of up to four pairs of rows; a pair past lenCeps sums its
    // zero padding and is dropped.
    const int64_t pairs = pairCount(d->lenCeps);
    for (int64_t p = 0; p < pairs; p += 4) {
        const int group = pairs - p < 4 ? int(pairs - p) : 4;
        const double* w = d->pairs + p * 2 * n;
        double sums[8];
        switch (group) {  // a fixed count keeps the sums in registers
            case 4: pairSums<4>(w, pSrc, n, sums); break;
            case 3: pairSums<3>(w, pSrc, n, sums); break;
            case 2: pairSums<2>(w, pSrc, n, sums); break;
            default: pairSums<1>(w, pSrc, n, sums); break;
        }
        for (int q = 0; q < 2 * group && i <= d->lenCeps; ++q, ++i) finish(i, sums[q]);
    }
#endif
    for (; i <= d->lenCeps; ++i) finish(i, coefficient(i));
    if (d->withC0) pDst[d->lenCeps] = toFloat(coefficient(0) * double(d->lifter[0]));
    return StatusOk;
}
#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zorsCopyWithPadding_32f(const float* pSrc, int lenSrc, float* pDst, int lenDst) {
    if (Status s = anyNull(pSrc, pDst)) return s;
    if (lenSrc < 1 || lenDst < 1 || lenDst < lenSrc) return StatusBadSize;
    std::memmove(pDst, pSrc, sizeof(float) * lenSrc);
    std::memset(pDst + lenSrc, 0, sizeof(float) * (lenDst - lenSrc));
    return StatusOk;
}

Status ZOR_CALL zorsDCTLifterInitAlloc_32f(void** ppDCTLifter, int lenDCT, int lenCeps, int nLifter,
                                           float val) {
    if (!ppDCTLifter) return StatusNullPointer;
    if (!(lenDCT > 0 && lenCeps > 0 && nLifter >= 1 && lenDCT >= lenCeps)) return StatusBadSize;
    const int64_t rows = int64_t(lenCeps) + 1;
    // (the byte counts below would pass 64 bits first; the pair table refuses these anyway)
    if (rows * lenDCT > (int64_t(1) << 31)) return StatusNoMemory;
    const int64_t tableBytes = rows * lenDCT * 4;
    const int64_t pairBytes = pairCount(lenCeps) * 2 * lenDCT * 8;
    if (pairBytes > 0x7FFFFFFF) return StatusNoMemory;
    DctLifter* d = static_cast<DctLifter*>(mem::alignedAlloc(sizeof(DctLifter)));
    float* lifter = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(rows * 4)));
    float* dct = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(tableBytes)));
    double* pairs = static_cast<double*>(mem::alignedAlloc(static_cast<uint32_t>(pairBytes)));
    if (!d || !lifter || !dct || !pairs) {
        mem::alignedFree(d);
        mem::alignedFree(lifter);
        mem::alignedFree(dct);
        mem::alignedFree(pairs);
        return StatusNoMemory;
    }
    DoublePrecisionScope precision;
    const double pi = 3.141592653589793;
    const double half = static_cast<float>(0.5 * nLifter);
    for (int i = 0; i <= lenCeps; ++i) {
        lifter[i] = toFloat(toDouble(1.0 + half * std::sin(toDouble(i * pi) / nLifter)) * double(val));
        for (int j = 1; j <= lenDCT; ++j)
            dct[int64_t(i) * lenDCT + j - 1] =
                toFloat(std::cos(toDouble(toDouble((j - 0.5) * i) * pi) / lenDCT));
    }
    d->nLifter = nLifter;
    d->lenDCT = lenDCT;
    d->lenCeps = lenCeps;
    d->withC0 = 0;
    d->lifter = lifter;
    d->dct = dct;
    for (int64_t p = 0; p < pairCount(lenCeps); ++p)
        for (int64_t j = 0; j < lenDCT; ++j)
            for (int64_t h = 0; h < 2; ++h) {
                const int64_t row = 2 * p + 1 + h;
                pairs[(p * lenDCT + j) * 2 + h] = row <= lenCeps ? double(dct[row * lenDCT + j]) : 0.0;
            }
    d->pairs = pairs;
    *ppDCTLifter = d;
    return StatusOk;
}

Status ZOR_CALL zorsDCTLifterFree_32f(void* pDCTLifter) {
    if (!pDCTLifter) return StatusNullPointer;
    DctLifter* d = static_cast<DctLifter*>(pDCTLifter);
    mem::alignedFree(d->pairs);
    mem::alignedFree(d->dct);
    mem::alignedFree(d->lifter);
    mem::alignedFree(d);
    return StatusOk;
}

Status ZOR_CALL zorsNormEnergy_32f(float* pSrcDst, int step, int height, float silFloor,
                                   float energyScale) {
    if (!pSrcDst) return StatusNullPointer;
    if (step < 1 || height < 1) return StatusBadSize;
    DoublePrecisionScope precision;
    float emax = -3.4028235e38f;
    for (int64_t r = 0; r < height; ++r) {
        const float e = pSrcDst[r * step];
        if (e > emax) emax = e;
    }
    const float floorValue = toFloat(double(emax) - double(0.230259f) * double(silFloor));
    for (int64_t r = 0; r < height; ++r) {
        float& e = pSrcDst[r * step];
        const float kept = e > floorValue ? e : floorValue;
        e = toFloat(1.0 - toDouble(double(emax) - double(kept)) * double(energyScale));
    }
    return StatusOk;
}

Status ZOR_CALL zorsSignChangeRate_16s(const int16_t* pSrc, int len, int32_t* pRes) {
    if (Status s = anyNull(pSrc, pRes)) return s;
    if (len < 1) return StatusBadSize;
    int32_t count = 0;
    for (int n = 1; n < len; ++n) count += (int32_t(pSrc[n - 1]) * pSrc[n] < 0) ? 1 : 0;
    *pRes = count;
    return StatusOk;
}

Status ZOR_CALL zorsAutoCorrLagMax_Fwd_16s(const int16_t* pSrc, int len, int lowerLag, int upperLag,
                                           int32_t* pMax, int* pMaxLag) {
    if (Status s = anyNull(pSrc, pMax, pMaxLag)) return s;
    if (len < 1) return StatusBadSize;
    if (lowerLag > upperLag) {
        *pMaxLag = 0;
        *pMax = INT32_MIN;
        return StatusOk;
    }
    int32_t best = 0;
    int bestLag = lowerLag;
    for (int64_t lag = lowerLag; lag <= upperLag; ++lag) {
        uint32_t r = 0;  // wraps like the 32-bit sum it stands for
        for (int n = 0; n < len; ++n)
            r += static_cast<uint32_t>(int32_t(pSrc[n]) * int32_t(pSrc[n + lag]));
        const int32_t v = static_cast<int32_t>(r);
        if (lag == lowerLag || v > best) {
            best = v;
            bestLag = static_cast<int>(lag);
        }
    }
    *pMaxLag = bestLag;
    *pMax = best >= (1 << 30) ? INT32_MAX : best < -(1 << 30) ? INT32_MIN : 2 * best;
    return StatusOk;
}
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

}}  // namespace zor::ZOR_NS
