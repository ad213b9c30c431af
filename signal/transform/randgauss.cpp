// Normal random numbers: uniforms from a subtract-with-borrow generator
// added to a linear congruential one, turned normal by the polar method.
// The state carries a half-used pair across calls, so a draw split into
// several calls gives the same sequence as one call.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/memory.h"

#include <cmath>

namespace zor { namespace ZOR_NS {
namespace {

constexpr uint32_t kId = 40;
constexpr uint32_t kLcgStart = 1131199209u;  // 0x436CBAE9, whatever the seed
// Deliberately the decimal constant, a hair below 2^-31: the sequence of
// every existing state depends on it.
constexpr double kUnit = 4.656612873077e-10;

struct GaussState {
    uint32_t id;
    uint32_t seed;
    float mean;
    float stdDev;
    uint32_t lcg;
    uint32_t swbA, swbB, swbC;
    int32_t borrow;
    int32_t needPair;  // 1: no value pending
    double pendingFactor;
    double pendingUniform;
};

struct Generator {
    uint32_t lcg, a, b, c, borrow;

    // One pair of uniforms in (-1, 1).
    void pair(double& u1, double& u2) {
        const uint32_t m = lcg * 69069u;
        const uint32_t t = b - c + borrow;
        const uint32_t top = t >> 31;
        const uint32_t tp = top ? t - 18u : t;
        u1 = kUnit * static_cast<double>(static_cast<int32_t>(tp + m + 1013904243u));
        const uint32_t s = a - b - top;
        uint32_t an;
        if (static_cast<int32_t>(s) < 0) {
            borrow = 0xFFFFFFFFu;
            an = s - 18u;
        } else {
            borrow = 0;
            an = s;
        }
        c = a;
        b = tp;
        a = an;
        lcg = m * 69069u + 924302730u;  // two congruential steps at once
        u2 = kUnit * static_cast<double>(static_cast<int32_t>(a + lcg));
    }
};

}  // namespace

Status ZOR_CALL zorsRandGaussInitAlloc_32f(void** ppState, float mean, float stdDev, uint32_t seed) {
    if (!ppState) return StatusNullPointer;
    GaussState* st = static_cast<GaussState*>(mem::alignedAlloc(sizeof(GaussState)));
    if (!st) return StatusNoMemory;
    st->id = kId;
    st->seed = seed;
    st->mean = mean;
    st->stdDev = stdDev;
    st->lcg = kLcgStart;
    st->swbA = seed;
    st->swbB = seed * 69069u + 1013904243u;
    st->swbC = st->swbB * 69069u + 1013904243u;
    st->borrow = -1;
    st->needPair = 1;
    st->pendingFactor = 0.0;
    st->pendingUniform = 0.0;
    *ppState = st;
    return StatusOk;
}

Status ZOR_CALL zorsRandGauss_32f(float* pDst, int len, void* pState) {
    if (Status s = anyNull(pDst, pState)) return s;
    if (len < 1) return StatusBadSize;
    GaussState* st = static_cast<GaussState*>(pState);
    if (st->id != kId) return StatusContextMismatch;

    DoublePrecisionScope precision;
    Generator g{st->lcg, st->swbA, st->swbB, st->swbC, static_cast<uint32_t>(st->borrow)};
    const double mean = st->mean, sd = st->stdDev;
    int i = 0;
    if (!st->needPair) {
        pDst[i++] = toFloat(toDouble(sd * st->pendingFactor) * st->pendingUniform + mean);
        st->needPair = 1;
    }
    // Pairs in batches: draw the accepted uniforms first (acceptance
    // without a branch), then the logarithms and roots, which no longer
    // wait on one another, then the values.
    constexpr int kBatch = 64;
    double u1s[kBatch], u2s[kBatch], qs[kBatch];
    while (i < len) {
        const int remaining = (len - i + 1) / 2;
        const int want = remaining < kBatch ? remaining : kBatch;
        int got = 0;
        while (got < want) {
            double u1, u2;
            g.pair(u1, u2);
            const double q = toDouble(toDouble(u1 * u1) + toDouble(u2 * u2));
            u1s[got] = u1;
            u2s[got] = u2;
            qs[got] = q;
            got += (q < 1.0) & (q != 0.0);
        }
        double fs[kBatch];
        for (int t = 0; t < want; ++t) fs[t] = toDouble(-2.0 * std::log(qs[t]));
        int t = 0;
#if ZOR_SIMD >= 2
        // IEEE division and square root: the same bits two at a time
        for (; t + 2 <= want; t += 2)
            _mm_storeu_pd(fs + t, _mm_sqrt_pd(_mm_div_pd(_mm_loadu_pd(fs + t), _mm_loadu_pd(qs + t))));
#endif
        for (; t < want; ++t) fs[t] = std::sqrt(toDouble(fs[t] / qs[t]));
        for (t = 0; t < want; ++t) {
            const double sf = toDouble(sd * fs[t]);
            pDst[i++] = toFloat(toDouble(sf * u2s[t]) + mean);
            if (i < len) {
                pDst[i++] = toFloat(toDouble(sf * u1s[t]) + mean);
            } else {
                st->needPair = 0;
                st->pendingFactor = fs[t];
                st->pendingUniform = u1s[t];
            }
        }
    }
    st->lcg = g.lcg;
    st->swbA = g.a;
    st->swbB = g.b;
    st->swbC = g.c;
    st->borrow = static_cast<int32_t>(g.borrow);
    return StatusOk;
}

Status ZOR_CALL zorsRandGaussFree_32f(void* pState) {
    if (!pState) return StatusNullPointer;
    GaussState* st = static_cast<GaussState*>(pState);
    if (st->id != kId) return StatusContextMismatch;
    st->id = 0;
    mem::alignedFree(st);
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
