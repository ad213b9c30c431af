// Interpolation weights and index tables of the geometry engines.
//
// The one-dimensional kernels (weights of the taps around a sample point),
// where the destination pixels of one direction sample the source
// (AxisMap), and the tap tables that a separable pass reads: for every
// destination pixel its first source pixel and the weights of its
// consecutive taps.  Everything here is computed in double; the engines
// convert the weights once into the form their row passes use.
//
// Callers that compute weights hold a DoublePrecisionScope, so that the
// x87 variants of the 32-bit build round like the others and every variant
// gets the same tables.
#pragma once

#include <cmath>
#include <cstdint>

#include "zor.h"

namespace zor { namespace ZOR_NS { namespace {

// ---- one-dimensional kernels ----------------------------------------------------

// Taps of a kernel: its weights at sample point x0 + t (0 <= t < 1) belong
// to the pixels x0 - (taps / 2 - 1) .. x0 + taps / 2.
constexpr int kernelTaps(int interpolation) {
    return interpolation == InterNearest ? 1
         : interpolation == InterCubic   ? 4
         : interpolation == InterLanczos ? 6
                                         : 2;
}

// Catmull-Rom spline (a = -0.5) at distance d from the sample point.
inline double catmullRom(double d) {
    d = std::fabs(d);
    if (d <= 1) return (1.5 * d - 2.5) * d * d + 1;
    if (d < 2) return ((-0.5 * d + 2.5) * d - 4) * d + 2;
    return 0;
}

// Lanczos window with 3 lobes: sinc(d) sinc(d / 3) for |d| < 3.
inline double lanczos3(double d) {
    d = std::fabs(d);
    if (d == 0) return 1;
    if (d >= 3) return 0;
    const double a = 3.141592653589793 * d;
    return 3 * std::sin(a) * std::sin(a / 3) / (a * a);
}

// Weights of the kernel's taps for fractional offset t (see kernelTaps).
inline void kernelWeights(int interpolation, double t, double* w) {
    switch (interpolation) {
    case InterNearest:
        w[0] = 1;
        break;
    case InterCubic:
        for (int k = 0; k < 4; ++k) w[k] = catmullRom(t + 1 - k);
        break;
    case InterLanczos: {
        double sum = 0;
        for (int k = 0; k < 6; ++k) sum += w[k] = lanczos3(t + 2 - k);
        for (int k = 0; k < 6; ++k) w[k] /= sum;
        break;
    }
    default:
        w[0] = 1 - t;
        w[1] = t;
    }
}

// ---- where destination pixels sample ----------------------------------------------

// One direction of a mapping from destination pixel index i to a source
// position (in pixels, pixel j at j).
struct AxisMap {
    bool centred;   // pixel centres aligned: origin + (i + 0.5) / factor - 0.5
    double origin;  // centred: the ROI's first pixel; else the position of pixel `shift`
    double factor;  // centred: destination / source size
    double shift;   // otherwise: origin + (i - shift) * step
    double step;    //            source pixels per destination pixel
    int skip = 0;   // index i of a call is pixel i + skip of the mapping

    static AxisMap centres(double roiStart, double factor) { return {true, roiStart, factor, 0, 0}; }
    static AxisMap points(double origin, double shift, double step) { return {false, origin, 0, shift, step}; }

    double at(int i) const {
        const double j = double(i) + skip;
        return centred ? origin + (j + 0.5) / factor - 0.5 : origin + (j - shift) * step;
    }
    // The source interval [lo, hi) that destination pixel i covers, pixel j
    // covering [j, j + 1).
    void footprint(int i, double& lo, double& hi) const {
        if (centred) {
            const double j = double(i) + skip;
            lo = origin + j / factor;
            hi = origin + (j + 1) / factor;
        } else {
            const double c = at(i) + 0.5;
            lo = c - step / 2;
            hi = c + step / 2;
        }
    }
    // Whether a destination pixel covers at least one source pixel (where
    // super-sampling averages rather than interpolates).
    bool shrinks() const { return centred ? factor <= 1 : step >= 1; }
};

// x limited to [lo, hi]; NaN gives lo.
inline double clampTo(double x, double lo, double hi) { return !(x >= lo) ? lo : x > hi ? hi : x; }

// The source pixel nearest to destination pixel i, on an axis of n pixels.
inline int nearestPixel(const AxisMap& m, int i, int n) {
    return static_cast<int>(std::floor(clampTo(m.at(i) + 0.5, 0, n - 1)));
}

// Area taps of destination pixel i: the pixels its footprint overlaps, each
// weighted by the overlap over the footprint's length; overlap beyond the
// image counts for the edge pixel.  Returns the count; writes the weights
// when w is given.
inline int areaTaps(const AxisMap& m, int i, int n, int& first, double* w) {
    double lo, hi;
    m.footprint(i, lo, hi);
    // Footprints reaching absurdly far (extreme factors) are cut where the
    // part inside the image no longer shows in a double.
    constexpr double kFar = 1152921504606846976.0;  // 2^60
    lo = clampTo(lo, -kFar, n + kFar);
    hi = clampTo(hi, lo, n + kFar);
    const double len = hi > lo ? hi - lo : 1;
    const double a = clampTo(lo, 0, n), b = clampTo(hi, 0, n);
    int j0 = static_cast<int>(std::floor(a)), j1 = static_cast<int>(std::ceil(b));
    if (j0 > n - 1) j0 = n - 1;
    if (j1 < j0 + 1) j1 = j0 + 1;
    first = j0;
    if (w) {
        for (int j = j0; j < j1; ++j) {
            const double cover = (b < j + 1 ? b : j + 1) - (a > j ? a : j);
            w[j - j0] = cover > 0 ? cover / len : 0;
        }
        const double before = (hi < 0 ? hi : 0) - lo, after = hi - (lo > n ? lo : n);
        if (before > 0) w[0] += before / len;
        if (after > 0) w[j1 - j0 - 1] += after / len;
    }
    return j1 - j0;
}

// Taps of destination pixel i on an axis of n pixels for an interpolation
// mode (super-sampling: area taps where the axis shrinks, linear elsewhere).
// Returns the count; the first pixel may lie outside the image (its taps
// then read the edge pixel), by at most count - 1.
inline int axisTaps(const AxisMap& m, int mode, int i, int n, int& first, double* w) {
    if (mode == InterSuper) {
        if (m.shrinks()) return areaTaps(m, i, n, first, w);
        mode = InterLinear;
    }
    const int taps = kernelTaps(mode);
    // Far outside the image every tap reads the edge pixel: any position
    // there gives the same value.
    const double s = clampTo(m.at(i), -taps - 1.0, n + 1.0);
    const double x0 = std::floor(s);
    first = static_cast<int>(x0) - (taps / 2 - 1);
    if (first < 1 - taps) first = 1 - taps;
    if (first > n - 1) first = n - 1;
    if (w) kernelWeights(mode, s - x0, w);
    return taps;
}

// ---- tap tables ----------------------------------------------------------------------

// The taps of every destination pixel of one direction, weights of type W.
// Uniform tables give every pixel `taps` weights (narrower footprints padded
// with zero weights); others keep each pixel's own count.
template <class W>
struct AxisTable {
    bool uniform = false;
    int taps = 0;       // uniform: taps per destination pixel; otherwise the widest
    int lo = 0, hi = 0; // source pixels the taps read: [lo, hi)
    int32_t* first = nullptr;   // per destination pixel
    int32_t* offset = nullptr;  // pixel i: weight[offset[i]] .. weight[offset[i + 1] - 1]
    W* weight = nullptr;

    int count(int i) const { return offset[i + 1] - offset[i]; }
    const W* weights(int i) const { return weight + offset[i]; }
};

// What a table of d destination pixels needs: the widest count and the sum
// of the counts.
struct AxisShape {
    int widest = 0;
    int64_t total = 0;
    int64_t entries(bool uniform, int d) const { return uniform ? int64_t(widest) * d : total; }
};

inline AxisShape axisShape(const AxisMap& m, int mode, int d, int n) {
    AxisShape s;
    for (int i = 0; i < d; ++i) {
        int first;
        const int c = axisTaps(m, mode, i, n, first, nullptr);
        if (c > s.widest) s.widest = c;
        s.total += c;
    }
    return s;
}

// Fills a table whose arrays are sized by axisShape; quantize converts each
// double weight; scratch holds `widest` doubles.
template <class W, class Quantize>
void fillAxisTable(AxisTable<W>& t, const AxisMap& m, int mode, int d, int n, bool uniform, int widest,
                   Quantize quantize, double* scratch) {
    t.uniform = uniform;
    t.taps = widest;
    t.lo = n;
    t.hi = 0;
    int32_t at = 0;
    for (int i = 0; i < d; ++i) {
        int first;
        const int c = axisTaps(m, mode, i, n, first, scratch);
        const int stored = uniform ? widest : c;
        t.first[i] = first;
        t.offset[i] = at;
        for (int k = 0; k < stored; ++k) t.weight[at + k] = quantize(k < c ? scratch[k] : 0.0);
        at += stored;
        if (first < t.lo) t.lo = first;
        if (first + stored > t.hi) t.hi = first + stored;
    }
    t.offset[d] = at;
}

// Weights in 1/16384, rounded to nearest.
inline int16_t fixedWeight(double w) { return static_cast<int16_t>(std::floor(w * 16384 + 0.5)); }

}}}  // namespace zor::ZOR_NS::(anonymous)
