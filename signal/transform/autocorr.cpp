// Autocorrelation: dst[k] = sum over n of src[n] src[n + k], terms past the
// end taken as 0, each sum accumulated in double in increasing n and rounded
// once.  The SIMD path computes several lags side by side, every lane still
// summing in increasing n, so every variant gives the same bits.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"

namespace zor { namespace ZOR_NS {
namespace {

// Terms n = from .. to - 1 of lag k, added to acc in order.
inline double lagTerms(const float* x, int k, int from, int to, double acc) {
    for (int n = from; n < to; ++n) acc = toDouble(acc + double(x[n]) * double(x[n + k]));
    return acc;
}

}  // namespace

Status ZOR_CALL zorsAutoCorr_32f(const float* pSrc, int srcLen, float* pDst, int dstLen) {
    if (Status s = anyNull(pSrc, pDst)) return s;
    if (srcLen < 1 || dstLen < 1) return StatusBadSize;
    DoublePrecisionScope precision;
    const int lags = dstLen < srcLen ? dstLen : srcLen;
    int k = 0;
#if ZOR_SIMD >= 2
    // Four lags at once: lanes k .. k+3 share the terms n < srcLen - k - 3;
    // the longer lanes then finish their last few terms one by one.
    for (; k + 4 <= lags; k += 4) {
        const int common = srcLen - k - 3;
        __m128d lo = _mm_setzero_pd(), hi = _mm_setzero_pd();
        for (int n = 0; n < common; ++n) {
            const __m128d x = _mm_set1_pd(pSrc[n]);
            const __m128 y = _mm_loadu_ps(pSrc + n + k);
            lo = _mm_add_pd(lo, _mm_mul_pd(x, _mm_cvtps_pd(y)));
            hi = _mm_add_pd(hi, _mm_mul_pd(x, _mm_cvtps_pd(_mm_movehl_ps(y, y))));
        }
        double acc[4];
        _mm_storeu_pd(acc, lo);
        _mm_storeu_pd(acc + 2, hi);
        for (int j = 0; j < 4; ++j)
            pDst[k + j] = toFloat(lagTerms(pSrc, k + j, common > 0 ? common : 0, srcLen - k - j, acc[j]));
    }
#endif
    for (; k < lags; ++k) pDst[k] = toFloat(lagTerms(pSrc, k, 0, srcLen - k, 0.0));
    for (; k < dstLen; ++k) pDst[k] = 0.0f;
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
