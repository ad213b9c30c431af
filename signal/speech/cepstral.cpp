// Speech front-end helpers: pre-emphasis, padded copy, cosine transform
// with lifter, energy normalisation, sign-change rate and the forward
// autocorrelation peak search.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
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
};

}  // namespace

// x[n] -= val x[n-1] from the end, so every step sees the original x[n-1].
// In double, rounded once; the SSE2 path does the same four at a time.
#if ZOR_VARIANT != 1
Status ZOR_CALL zorsPreemphasize_32f(float* pSrcDst, int len, float val) {
    if (!pSrcDst) return StatusNullPointer;
    if (len < 1) return StatusBadSize;
    DoublePrecisionScope precision;
    float* x = pSrcDst;
    const double v = val;
    int n = len - 1;
#if ZOR_SIMD >= 2
    const __m128d vv = _mm_set1_pd(v);
    for (; n >= 4; n -= 4) {
        const __m128 cur = _mm_loadu_ps(x + n - 3), prev = _mm_loadu_ps(x + n - 4);
        const __m128d lo = _mm_sub_pd(_mm_cvtps_pd(cur), _mm_mul_pd(vv, _mm_cvtps_pd(prev)));
        const __m128d hi = _mm_sub_pd(_mm_cvtps_pd(_mm_movehl_ps(cur, cur)),
                                      _mm_mul_pd(vv, _mm_cvtps_pd(_mm_movehl_ps(prev, prev))));
        _mm_storeu_ps(x + n - 3, _mm_movelh_ps(_mm_cvtpd_ps(lo), _mm_cvtpd_ps(hi)));
    }
#endif
    for (; n >= 1; --n) x[n] = toFloat(double(x[n]) - v * double(x[n - 1]));
    return StatusOk;
}
#endif

// Cosine transform with lifter: the SSE2 path sums eight coefficients at once.
#if ZOR_VARIANT != 1
Status ZOR_CALL zorsDCTLifter_32f(const float* pSrc, float* pDst, const void* pDCTLifter) {
    if (Status s = anyNull(pSrc, pDst, pDCTLifter)) return s;
    const DctLifter* d = static_cast<const DctLifter*>(pDCTLifter);
    DoublePrecisionScope precision;
    const int n = d->lenDCT;
    const float* table = d->dct;
    auto row = [&](int i) { return table + int64_t(i) * n; };
    // Several coefficients side by side: independent sums, each still in
    // increasing j (the products of two floats are exact in double).
    int i = 1;
#if ZOR_SIMD >= 2
    for (; i + 7 <= d->lenCeps; i += 8) {
        __m128d acc[4] = {_mm_setzero_pd(), _mm_setzero_pd(), _mm_setzero_pd(), _mm_setzero_pd()};
        for (int j = 0; j < n; ++j) {
            const __m128d x = _mm_set1_pd(pSrc[j]);
            for (int q = 0; q < 4; ++q) {
                const __m128d w = _mm_set_pd(row(i + 2 * q + 1)[j], row(i + 2 * q)[j]);
                acc[q] = _mm_add_pd(acc[q], _mm_mul_pd(w, x));
            }
        }
        double sums[8];
        for (int q = 0; q < 4; ++q) _mm_storeu_pd(sums + 2 * q, acc[q]);
        for (int q = 0; q < 8; ++q) pDst[i + q - 1] = toFloat(sums[q] * double(d->lifter[i + q]));
    }
#endif
    for (; i + 3 <= d->lenCeps; i += 4) {
        const float *r0 = row(i), *r1 = row(i + 1), *r2 = row(i + 2), *r3 = row(i + 3);
        double a0 = 0.0, a1 = 0.0, a2 = 0.0, a3 = 0.0;
        for (int j = 0; j < n; ++j) {
            const double x = pSrc[j];
            a0 = toDouble(a0 + double(r0[j]) * x);
            a1 = toDouble(a1 + double(r1[j]) * x);
            a2 = toDouble(a2 + double(r2[j]) * x);
            a3 = toDouble(a3 + double(r3[j]) * x);
        }
        pDst[i - 1] = toFloat(a0 * double(d->lifter[i]));
        pDst[i] = toFloat(a1 * double(d->lifter[i + 1]));
        pDst[i + 1] = toFloat(a2 * double(d->lifter[i + 2]));
        pDst[i + 2] = toFloat(a3 * double(d->lifter[i + 3]));
    }
    auto coefficient = [&](int k) {
        const float* r = row(k);
        double acc = 0.0;
        for (int j = 0; j < n; ++j) acc = toDouble(acc + double(r[j]) * double(pSrc[j]));
        return toFloat(acc * double(d->lifter[k]));
    };
    for (; i <= d->lenCeps; ++i) pDst[i - 1] = coefficient(i);
    if (d->withC0) pDst[d->lenCeps] = coefficient(0);
    return StatusOk;
}
#endif

#if ZOR_VARIANT == 0
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
    const int64_t tableBytes = rows * lenDCT * 4;
    if (tableBytes > 0x7FFFFFFF) return StatusNoMemory;
    DctLifter* d = static_cast<DctLifter*>(mem::alignedAlloc(sizeof(DctLifter)));
    float* lifter = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(rows * 4)));
    float* dct = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(tableBytes)));
    if (!d || !lifter || !dct) {
        mem::alignedFree(d);
        mem::alignedFree(lifter);
        mem::alignedFree(dct);
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
    *ppDCTLifter = d;
    return StatusOk;
}

Status ZOR_CALL zorsDCTLifterFree_32f(void* pDCTLifter) {
    if (!pDCTLifter) return StatusNullPointer;
    DctLifter* d = static_cast<DctLifter*>(pDCTLifter);
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
#endif  // ZOR_VARIANT == 0

}}  // namespace zor::ZOR_NS
