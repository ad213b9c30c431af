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
// Every result depends on the exact sequence of roundings in the
// recurrence, a serial chain of one multiply and one add per round: that
// chain, not the data, bounds the speed, so one generic entry serves every
// processor.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"

#include <cmath>
#include <cstring>
#include <limits>

namespace zor { namespace ZOR_NS {

#if ZOR_VARIANT == 0
namespace {

constexpr double kTwoPi = 6.283185307179586;

struct Hamming {
    static double weight(double cosine) { return 0.54 - 0.46 * cosine; }
};
struct Hann {
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

template <class Kind, class T>
Status applyWindow(const T* pSrc, T* pDst, int len) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), len < 3 ? StatusBadSize : StatusOk)) return s;

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
        const double w = Kind::weight(cosine);
        pDst[front] = weigh(pSrc[front], w);
        pDst[back] = weigh(pSrc[back], w);
        const double nextCos = cosine * c - sine * s;
        sine = sine * c + cosine * s;
        cosine = nextCos;
    }
    if (len & 1) {
        // The middle keeps its bits (no trip through the FPU).
        if (pDst != pSrc) std::memcpy(pDst + front, pSrc + front, sizeof(T));
    } else {
        const double w = Kind::weight(cosine);
        pDst[front] = weigh(pSrc[front], w);
        pDst[back] = weigh(pSrc[back], w);
    }
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
#endif  // ZOR_VARIANT == 0

}}  // namespace zor::ZOR_NS
