// Hamming and Hann windows over a whole frame.
//
// The weights come from a rotation recurrence rather than a cosine per
// sample: c = cos(2 pi / (N - 1)) once, s = sqrt(1 - c^2), and the pair
// (cos, sin) of successive angles is rotated by (c, s) starting from (1, 0),
// in double precision.  The frame is walked from both ends at once, so each
// weight serves the front element and its mirror at the back.  With N odd
// the middle element keeps its value (its weight is 1); with N even the two
// middle elements take the weight of the angle after the last round.
//
// Every weight depends on the exact sequence of roundings in the
// recurrence, a serial chain of one multiply and one add per round, which
// takes far longer than the multiplications it feeds.  Callers apply the
// same window to frame after frame, so the SSE2 variants keep the weights of
// the last window they built (kind, length and the floating-point control
// state they were computed under) and apply them as a table: the products
// are the same double multiplies rounded once, so the bits do not change
// (at any register width: the wide columns apply the table with their own).
// The generic variant, and any call that finds the table in use by another
// thread or too long to keep, runs the recurrence as it goes.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/mxcsr.h"
#include "frame/simd.h"

#include <cmath>
#include <cstring>
#include <limits>

namespace zor { namespace ZOR_NS {

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
namespace {

constexpr double kTwoPi = 6.283185307179586;

struct Hamming {
    static constexpr int id = 1;
    static double weight(double cosine) { return 0.54 - 0.46 * cosine; }
};
struct Hann {
    static constexpr int id = 2;
    static double weight(double cosine) { return 0.5 * (1.0 - cosine); }
};

// One element times a weight: float data is multiplied in double and
// rounded once; 16-bit data is multiplied in double and truncated toward
// zero.
inline float weigh(float v, double w) { return toFloat(double(v) * w); }
inline double weigh(double v, double w) { return toDouble(v * w); }
inline int16_t weigh(int16_t v, double w) {
    const double p = double(v) * w;
    // |w| <= 1 up to the recurrence's rounding, so the clamp only guards
    // -32768 times a weight a hair above 1.
    if (p >= 32767.0) return 32767;
    if (p <= -32768.0) return -32768;
    return static_cast<int16_t>(static_cast<int32_t>(p));
}
template <class C>
inline C weigh(const C& v, double w) {
    return C{weigh(v.re, w), weigh(v.im, w)};
}

// Runs the recurrence, handing each round's weight to visit(front, back, w)
// and, for even N, the middle pair's weight last.  visit runs inside the
// 53-bit precision scope.
template <class Kind, class Visit>
void walkWeights(int len, Visit&& visit) {
    // The angle step is rounded to double before the cosine sees it; the
    // cosine itself runs with the caller's FPU settings in every variant.
    double step;
    {
        DoublePrecisionScope fpu;
        step = toDouble(kTwoPi / double(len - 1));
    }
    const double c = toDouble(std::cos(step));

    DoublePrecisionScope fpu;
    const double s = toDouble(std::sqrt(1.0 - c * c));
    double cosine = 1.0, sine = 0.0;
    int front = 0, back = len - 1;
    for (const int rounds = (len - 1) / 2; front < rounds; ++front, --back) {
        visit(front, back, Kind::weight(cosine));
        const double nextCos = cosine * c - sine * s;
        sine = sine * c + cosine * s;
        cosine = nextCos;
    }
    if (!(len & 1)) visit(front, back, Kind::weight(cosine));
}

// Applies each weight as the recurrence yields it; with keep, also writes
// the weights there in frame order (the odd middle's 1 is a placeholder, as
// that element keeps its bits).
template <class Kind, class T>
void streamWindow(const T* pSrc, T* pDst, int len, double* keep = nullptr) {
    walkWeights<Kind>(len, [&](int front, int back, double w) {
        pDst[front] = weigh(pSrc[front], w);
        pDst[back] = weigh(pSrc[back], w);
        if (keep) keep[front] = keep[back] = w;
    });
    if (len & 1) {
        if (keep) keep[len / 2] = 1.0;
        // The middle keeps its bits (no trip through the FPU).
        if (pDst != pSrc) std::memcpy(pDst + len / 2, pSrc + len / 2, sizeof(T));
    }
}

#  if ZOR_SIMD >= 2
// ---- the kept table -------------------------------------------------------------

constexpr int kKeptMax = 4096;

// Zero-initialised static storage: busy is a spin-free try-lock, kind 0
// matches no window.
struct KeptWeights {
    int busy;
    int kind, len;
    uint32_t state;
    alignas(64) double w[kKeptMax];
};
KeptWeights kept;

template <class T>
void applyWeights(const T* s, T* d, int n, const double* w) {
    for (int i = 0; i < n; ++i) d[i] = weigh(s[i], w[i]);
}
// Registers of doubles at the column's width; the table is aligned to the
// widest register and read a register of weights at a time.
using D = simd::Vec<double>;
constexpr int kLanes = D::kLanes;

// Floats are widened in order straight from memory (loadWidened): no
// shuffle is needed to reach the upper half, which measured faster than
// splitting a register of floats.
void applyWeights(const float* s, float* d, int n, const double* w) {
    using namespace simd;
    const auto weighed = [&](int at) { return loadWidened<D>(s + at) * loadAligned<D>(w + at); };
    int i = 0;
    for (; i + 2 * kLanes <= n; i += 2 * kLanes) store(d + i, narrowInOrder<float>(weighed(i), weighed(i + kLanes)));
    for (; i < n; ++i) d[i] = weigh(s[i], w[i]);
}
// A register of floats holds kLanes complex elements; per 16-byte block
// widenLo/widenHi give its first and second element, and zipLo/zipHi of the
// weights the matching weight twice.
void applyWeights(const Complex32f* s, Complex32f* d, int n, const double* w) {
    using namespace simd;
    using F = Vec<float>;
    int k = 0;
    for (; k + kLanes <= n; k += kLanes) {
        const F x = loadFrom<F>(s + k);
        const D wk = loadAligned<D>(w + k);
        storeTo(d + k, narrowSat<float>(widenLo(x) * zipLo(wk, wk), widenHi(x) * zipHi(wk, wk)));
    }
    for (; k < n; ++k) d[k] = weigh(s[k], w[k]);
}
void applyWeights(const double* s, double* d, int n, const double* w) {
    using namespace simd;
    int i = 0;
    for (; i + kLanes <= n; i += kLanes) store(d + i, load<D>(s + i) * loadAligned<D>(w + i));
    for (; i < n; ++i) d[i] = weigh(s[i], w[i]);
}
void applyWeights(const Complex64f* s, Complex64f* d, int n, const double* w) {
    using namespace simd;
    using D2 = Vec<double, 16>;
    for (int k = 0; k < n; ++k) store(&d[k].re, load<D2>(&s[k].re) * set1<D2>(w[k]));
}

// Applies the kept table, or rebuilds it while applying the recurrence when
// it belongs to another window; false when another thread holds it or the
// frame is too long.
template <class Kind, class T>
bool keptWindow(const T* pSrc, T* pDst, int len) {
    if (len > kKeptMax || __atomic_exchange_n(&kept.busy, 1, __ATOMIC_ACQUIRE)) return false;
    const uint32_t state = arithmeticState();
    if (kept.kind != Kind::id || kept.len != len || kept.state != state) {
        streamWindow<Kind>(pSrc, pDst, len, kept.w);
        kept.kind = Kind::id;
        kept.len = len;
        kept.state = state;
    } else {
        T middle;
        std::memcpy(&middle, pSrc + len / 2, sizeof(T));
        applyWeights(pSrc, pDst, len, kept.w);
        if (len & 1) std::memcpy(pDst + len / 2, &middle, sizeof(T));
    }
    __atomic_store_n(&kept.busy, 0, __ATOMIC_RELEASE);
    return true;
}
#  endif

template <class Kind, class T>
Status applyWindow(const T* pSrc, T* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), len < 3 ? StatusBadSize : StatusOk)) return s;
#  if ZOR_SIMD >= 2
    if (keptWindow<Kind>(pSrc, pDst, len)) return StatusOk;
#  endif
    streamWindow<Kind>(pSrc, pDst, len);
    return StatusOk;
}

}  // namespace

Status ZOR_CALL zorsWinHamming_16s(const int16_t* pSrc, int16_t* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_16s_I(int16_t* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHamming_16sc(const Complex16s* pSrc, Complex16s* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_16sc_I(Complex16s* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHamming_32f(const float* pSrc, float* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_32f_I(float* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHamming_32fc(const Complex32f* pSrc, Complex32f* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_32fc_I(Complex32f* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHamming_64f(const double* pSrc, double* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_64f_I(double* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHamming_64fc(const Complex64f* pSrc, Complex64f* pDst, int len) {
    return applyWindow<Hamming>(pSrc, pDst, len);
}
Status ZOR_CALL zorsWinHamming_64fc_I(Complex64f* pSrcDst, int len) {
    return applyWindow<Hamming>(pSrcDst, pSrcDst, len);
}
Status ZOR_CALL zorsWinHann_32f_I(float* pSrcDst, int len) {
    return applyWindow<Hann>(pSrcDst, pSrcDst, len);
}
#endif  // ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

}}  // namespace zor::ZOR_NS
