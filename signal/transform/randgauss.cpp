// Normal random numbers: uniforms from a subtract-with-borrow generator
// added to a linear congruential one, turned normal by the polar method.
// The state carries a half-used pair across calls, so a draw split into
// several calls gives the same sequence as one call.  The logarithm is the
// library's own (randgauss_log.h), not the C runtime's, so the sequence is
// the same on every platform.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/memory.h"
#include "signal/transform/randgauss_log.h"

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

    // One pair of raw words; u1 and u2 are these read as signed, times kUnit.
    void pair(int32_t& w1, int32_t& w2) {
        const uint32_t m = lcg * 69069u;
        const uint32_t t = b - c + borrow;
        const uint32_t top = t >> 31;
        const uint32_t tp = top ? t - 18u : t;
        w1 = static_cast<int32_t>(tp + m + 1013904243u);
        const uint32_t s = a - b - top;
        // s < 0 as a signed word: borrow, and 18 less; without a branch, as
        // the sign is a coin toss
        const uint32_t negative = static_cast<uint32_t>(static_cast<int32_t>(s) >> 31);
        borrow = negative;
        const uint32_t an = s - (negative & 18u);
        c = a;
        b = tp;
        a = an;
        lcg = m * 69069u + 924302730u;  // two congruential steps at once
        w2 = static_cast<int32_t>(a + lcg);
    }
};

constexpr int kBatch = 64;

// Appends to (u1s, u2s, qs) from position got the pairs accepted among the
// next n drawn (n <= kBatch), returning the new count.  Every drawn pair is
// consumed, accepted or not, so drawing only as many as are still missing
// never draws past the last one needed.
int drawAccepted(Generator& g, int n, double* u1s, double* u2s, double* qs, int got) {
    int32_t w1[kBatch], w2[kBatch];
    for (int j = 0; j < n; ++j) g.pair(w1[j], w2[j]);
    int j = 0;
#if ZOR_SIMD >= 2
    // two pairs per 16-byte register, each kept or dropped on its own
    using namespace simd;
    using I4 = Vec<int32_t, 16>;
    using D2 = Vec<double, 16>;
    const D2 unit = set1<D2>(kUnit), one = set1<D2>(1.0), z = zero<D2>();
    for (; j + 2 <= n; j += 2) {
        const D2 u1 = unit * toDoubleLo(loadHalf<I4>(w1 + j));
        const D2 u2 = unit * toDoubleLo(loadHalf<I4>(w2 + j));
        const D2 q = u1 * u1 + u2 * u2;
        const int ok = laneMask(andNot(eq(q, z), lt(q, one)));
        u1s[got] = getLane<0>(u1);
        u2s[got] = getLane<0>(u2);
        qs[got] = getLane<0>(q);
        got += ok & 1;
        u1s[got] = getLane<1>(u1);
        u2s[got] = getLane<1>(u2);
        qs[got] = getLane<1>(q);
        got += ok >> 1;
    }
#endif
    for (; j < n; ++j) {
        const double u1 = toDouble(kUnit * w1[j]), u2 = toDouble(kUnit * w2[j]);
        const double q = toDouble(toDouble(u1 * u1) + toDouble(u2 * u2));
        u1s[got] = u1;
        u2s[got] = u2;
        qs[got] = q;
        got += (q < 1.0) & (q != 0.0);
    }
    return got;
}

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
    // Pairs in batches: the raw words first (the generator's own chain
    // alone), then the uniforms and the acceptance without a branch, then
    // the logarithms and roots, which do not wait on one another, then the
    // values.  A slot past the accepted ones may be overwritten by a rejected
    // pair, hence one spare.
    double u1s[kBatch + 1], u2s[kBatch + 1], qs[kBatch + 1];
    while (i < len) {
        const int remaining = (len - i + 1) / 2;
        const int want = remaining < kBatch ? remaining : kBatch;
        int got = 0;
        while (got < want) got = drawAccepted(g, want - got, u1s, u2s, qs, got);
        double fs[kBatch];
        for (int t = 0; t < want; ++t) fs[t] = toDouble(-2.0 * logOfPositive(qs[t]));
        int t = 0;
#if ZOR_SIMD >= 2
        // IEEE division and square root: the same bits a register at a time
        using D = simd::Vec<double>;
        for (; t + D::kLanes <= want; t += D::kLanes)
            simd::store(fs + t, simd::sqrt(simd::load<D>(fs + t) / simd::load<D>(qs + t)));
#endif
        for (; t < want; ++t) fs[t] = std::sqrt(toDouble(fs[t] / qs[t]));
        t = 0;
#if ZOR_SIMD >= 2
        // Whole pairs two at a time: (u2, u1) of pair t, then of pair t + 1.
        const int whole = (len - i) / 2 < want ? (len - i) / 2 : want;
        {
            using namespace simd;
            using D2 = Vec<double, 16>;
            const D2 sdV = set1<D2>(sd), meanV = set1<D2>(mean);
            for (; t + 2 <= whole; t += 2, i += 4) {
                const D2 sf = sdV * load<D2>(fs + t);
                const D2 v2 = sf * load<D2>(u2s + t) + meanV;
                const D2 v1 = sf * load<D2>(u1s + t) + meanV;
                store(pDst + i, narrowSat<float>(zipLo(v2, v1), zipHi(v2, v1)));
            }
        }
#endif
        for (; t < want; ++t) {
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
