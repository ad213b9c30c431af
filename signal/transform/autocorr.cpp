// Autocorrelation: dst[k] = sum over n of src[n] src[n + k], terms past the
// end taken as 0, each sum accumulated in double and rounded once.
//
// Few lags: the direct sums in increasing n.  The SIMD path computes several
// lags side by side, every lane still summing in increasing n, so every
// variant gives the same bits.  Many lags over a long signal: through the
// power spectrum in double, which agrees with the direct sums to float
// rounding.  The choice depends only on the lengths, never on the variant.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/memory.h"

#include <cmath>
#include <utility>

namespace zor { namespace ZOR_NS {
namespace {

// Terms n = from .. to - 1 of lag k, added to acc in order.
inline double lagTerms(const float* x, int k, int from, int to, double acc) {
    for (int n = from; n < to; ++n) acc = toDouble(acc + double(x[n]) * double(x[n + k]));
    return acc;
}

// ---- long lags through the spectrum ----------------------------------------------
//
// For many lags the sums are cheaper as |X|^2 transformed back: zero-pad the
// signal to a power of two M >= srcLen + lags - 1 (so no lag wraps round),
// transform, take the power spectrum, transform again.  Everything runs in
// double, so each lag is off by a small multiple of log2(M) 2^-53 times
// lag 0 (the largest) before it is rounded to float: the same results as
// the direct sums to float rounding, though not always the same bits.

struct Cd {
    double re, im;
};

// In-place radix-2 transform with the kernel exp(-2 pi i k n / m), m = 2^log2m,
// w[k] = exp(-2 pi i k / m) for k < m / 2.
void transform(Cd* a, const Cd* w, int log2m) {
    const int m = 1 << log2m;
    for (int i = 1, j = 0; i < m; ++i) {  // bit-reversed order
        int bit = m >> 1;
        for (; j & bit; bit >>= 1) j ^= bit;
        j ^= bit;
        if (i < j) std::swap(a[i], a[j]);
    }
    for (int half = 1, stride = m >> 1; half < m; half <<= 1, stride >>= 1) {
        for (int start = 0; start < m; start += 2 * half) {
            Cd* lo = a + start;
            Cd* hi = lo + half;
            for (int k = 0; k < half; ++k) {
                const Cd t = w[k * stride];
                const double re = toDouble(hi[k].re * t.re - hi[k].im * t.im);
                const double im = toDouble(hi[k].re * t.im + hi[k].im * t.re);
                hi[k] = {lo[k].re - re, lo[k].im - im};
                lo[k] = {lo[k].re + re, lo[k].im + im};
            }
        }
    }
}

// w[k] = exp(-2 pi i k / m), k < m / 2, from two short tables so that only
// about 2 sqrt(m) sines and cosines are evaluated (f: room for the fine
// table, 2^((log2m - 1) / 2) points).
void twiddles(Cd* w, Cd* f, int log2m) {
    const int count = 1 << (log2m - 1);
    const int fineBits = (log2m - 1) / 2, fine = 1 << fineBits;
    const double step = -6.283185307179586 / double(1 << log2m);
    for (int b = 0; b < fine; ++b) f[b] = {std::cos(step * b), std::sin(step * b)};
    for (int a = 0; a < count; a += fine) {
        const Cd c = {std::cos(step * a), std::sin(step * a)};
        for (int b = 0; b < fine; ++b)
            w[a + b] = {toDouble(c.re * f[b].re - c.im * f[b].im), toDouble(c.re * f[b].im + c.im * f[b].re)};
    }
}

// Cost of the direct sums against the two transforms, in multiply-adds of
// the direct loop; the factor on m log2 m was measured.
bool spectrumIsCheaper(int srcLen, int lags, int log2m) {
    const double direct = double(lags) * srcLen - 0.5 * double(lags) * lags;
    const double viaSpectrum = 4.0 * double(1 << log2m) * log2m;
    return viaSpectrum < direct;
}

// Forward transform of m real values a[0 .. m - 1] (m = 2^log2m, m >= 4):
// the m / 2 complex points (a[2n], a[2n + 1]) are transformed at half size
// with every other twiddle, then separated into the bins out[0 .. m / 2].
// w holds exp(-2 pi i k / m) for k < m / 2, z the m / 2 work points.
void realTransform(const double* a, Cd* z, Cd* out, const Cd* w, Cd* wHalf, int log2m) {
    const int h = 1 << (log2m - 1);
    for (int n = 0; n < h; ++n) z[n] = {a[2 * n], a[2 * n + 1]};
    transform(z, wHalf, log2m - 1);
    out[0] = {toDouble(z[0].re + z[0].im), 0.0};
    out[h] = {toDouble(z[0].re - z[0].im), 0.0};
    for (int k = 1; k < h; ++k) {
        const Cd p = z[k], q = {z[h - k].re, -z[h - k].im};  // q = conj(z[h - k])
        const Cd even = {0.5 * (p.re + q.re), 0.5 * (p.im + q.im)};
        const Cd odd = {0.5 * (p.im - q.im), -0.5 * (p.re - q.re)};  // (p - q) / 2i
        const Cd t = w[k];
        out[k] = {toDouble(even.re + toDouble(odd.re * t.re - odd.im * t.im)),
                  toDouble(even.im + toDouble(odd.re * t.im + odd.im * t.re))};
    }
}

// Fills dst[0 .. lags - 1]; false when the work memory is not available.
bool lagsBySpectrum(const float* x, int srcLen, float* dst, int lags, int log2m) {
    const int m = 1 << log2m, h = m / 2;
    const int fine = 1 << ((log2m - 1) / 2);
    // m reals, then h + 1 bins, h work points, h twiddles, h / 2 half-size
    // twiddles and the fine table.
    const uint32_t points = uint32_t(m / 2 + (h + 1) + h + h + h / 2 + fine);
    double* a = static_cast<double*>(mem::alignedAlloc(points * uint32_t(sizeof(Cd))));
    if (!a) return false;
    Cd* bins = reinterpret_cast<Cd*>(a + m);
    Cd* z = bins + h + 1;
    Cd* w = z + h;
    Cd* wHalf = w + h;
    twiddles(w, wHalf + h / 2, log2m);
    for (int k = 0; k < h / 2; ++k) wHalf[k] = w[2 * k];
    for (int n = 0; n < m; ++n) a[n] = n < srcLen ? double(x[n]) : 0.0;
    realTransform(a, z, bins, w, wHalf, log2m);
    // The power spectrum is real and even, so a second forward transform
    // is its inverse up to 1/m.
    for (int k = 0; k <= h; ++k) a[k] = toDouble(bins[k].re * bins[k].re + bins[k].im * bins[k].im);
    for (int k = h + 1; k < m; ++k) a[k] = a[m - k];
    realTransform(a, z, bins, w, wHalf, log2m);
    const double scale = 1.0 / m;
    for (int k = 0; k < lags; ++k) dst[k] = toFloat(bins[k].re * scale);
    mem::alignedFree(a);
    return true;
}

// The smallest power of two holding srcLen + lags - 1 points, or 0 when that
// is beyond what the spectrum path handles.
int spectrumOrder(int srcLen, int lags) {
    const int64_t need = int64_t(srcLen) + lags - 1;
    for (int b = 2; b <= 24; ++b)
        if ((int64_t(1) << b) >= need) return b;
    return 0;
}

}  // namespace

Status ZOR_CALL zorsAutoCorr_32f(const float* pSrc, int srcLen, float* pDst, int dstLen) {
    if (Status s = anyNull(pSrc, pDst)) return s;
    if (srcLen < 1 || dstLen < 1) return StatusBadSize;
    DoublePrecisionScope precision;
    const int lags = dstLen < srcLen ? dstLen : srcLen;
    int k = 0;
    const int log2m = spectrumOrder(srcLen, lags);
    if (log2m && spectrumIsCheaper(srcLen, lags, log2m) && lagsBySpectrum(pSrc, srcLen, pDst, lags, log2m)) k = lags;
#if ZOR_SIMD >= 2
    // Four lags at once: lanes k .. k+3 share the terms n < srcLen - k - 3;
    // the longer lanes then finish their last few terms one by one.
    for (; k + 4 <= lags; k += 4) {
        const int common = srcLen - k - 3;
        using namespace simd;
        using F4 = Vec<float, 16>;
        using D2 = Vec<double, 16>;
        D2 lo = zero<D2>(), hi = zero<D2>();
        for (int n = 0; n < common; ++n) {
            const D2 x = set1<D2>(pSrc[n]);
            const F4 y = load<F4>(pSrc + n + k);
            lo = lo + x * widenLo(y);
            hi = hi + x * widenHi(y);
        }
        double acc[4];
        store(acc, lo);
        store(acc + 2, hi);
        for (int j = 0; j < 4; ++j)
            pDst[k + j] = toFloat(lagTerms(pSrc, k + j, common > 0 ? common : 0, srcLen - k - j, acc[j]));
    }
#endif
    for (; k < lags; ++k) pDst[k] = toFloat(lagTerms(pSrc, k, 0, srcLen - k, 0.0));
    for (; k < dstLen; ++k) pDst[k] = 0.0f;
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
