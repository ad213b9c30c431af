// Point sampling for the warps and rotations: the engine entry that the
// rotations share, the fixed-point source positions and the kernels that
// interpolate the source at them.
//
// A position is an int64 holding the source point times 2^32, relative to
// the origin of the clipped source ROI: the high word is the pixel to the
// left of (above) the point, the low word its fraction.  A kernel gets a run
// of destination pixels of one row with their positions along x and y
// (offsets readable for kSlack entries past the run) and writes the run's
// pixels.
//
// Include after frame/variant.h.
#pragma once

#include "frame/fpu.h"
#include "frame/simd.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>

namespace zor { namespace ZOR_NS {

// The element type and channel count of a rotation's images.
enum class WarpPixels { u8C1, u8C3, u16C1, u16C3, f32C3 };

// The affine warp behind zoriWarpAffine_* and zoriRotate* (warp.cpp): its
// checks, order and rules are the exports' (see the manifest).
Status warpAffineImage(WarpPixels pixels, const void* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                       void* pDst, int dstStep, ImageRect dstRoi, const double coeffs[2][3], int interpolation);

namespace {

constexpr int kSlack = 16;                      // positions readable past a run
constexpr int64_t kHalfPixel = int64_t(1) << 31;

// p * 2^32 rounded to nearest (ties upwards); |p| < 2^30.
inline int64_t toFixed(double p) { return static_cast<int64_t>(std::floor(p * 4294967296.0 + 0.5)); }

// The clipped source ROI.
struct Source {
    const uint8_t* origin;  // its first pixel
    ptrdiff_t step;
    int width, height;
    // Bytes from a pixel read for a destination pixel to the one read for
    // the pixel below it (0: unknown): the register kernel asks for those
    // cache lines ahead.
    ptrdiff_t nextRow;
};

inline int clampIndex(int64_t i, int n) { return static_cast<int>(i < 0 ? 0 : i >= n ? n - 1 : i); }

template <class T, int C>
inline const T* pixelAt(const Source& s, int x, int y) {
    return reinterpret_cast<const T*>(s.origin + y * s.step) + ptrdiff_t(x) * C;
}

// A value of the definition (double) as stored: integers round half up and
// saturate, floats round to nearest.
template <class T>
inline T storedValue(double v) {
    if constexpr (std::is_floating_point_v<T>) {
        return toFloat(v);
    } else {
        const double r = std::floor(v + 0.5), top = double(std::numeric_limits<T>::max());
        return static_cast<T>(r <= 0 ? 0 : r >= top ? top : r);
    }
}

// A run's positions along one axis: base + offsets[i] (so that an affine row
// is a column table plus the row's term).
struct Positions {
    int64_t base;
    const int64_t* offsets;
    int64_t operator[](int i) const { return base + offsets[i]; }
    Positions operator+(int i) const { return {base, offsets + i}; }
};

using SampleRun = void (*)(const Source&, Positions xs, Positions ys, int n, uint8_t* dst);

// ---- nearest, and every type's linear and cubic in double ------------------------------

template <class T, int C>
void sampleNearest(const Source& s, Positions xs, Positions ys, int n, uint8_t* dst) {
    T* d = reinterpret_cast<T*>(dst);
    for (int i = 0; i < n; ++i) {
        const T* p = pixelAt<T, C>(s, clampIndex((xs[i] + kHalfPixel) >> 32, s.width),
                                   clampIndex((ys[i] + kHalfPixel) >> 32, s.height));
        for (int k = 0; k < C; ++k) d[i * C + k] = p[k];
    }
}

inline double fractionOf(int64_t position) { return double(uint32_t(position)) * (1.0 / 4294967296.0); }

template <class T, int C>
void sampleLinear(const Source& s, Positions xs, Positions ys, int n, uint8_t* dst) {
    T* d = reinterpret_cast<T*>(dst);
    for (int i = 0; i < n; ++i) {
        const int64_t x = xs[i] >> 32, y = ys[i] >> 32;
        const int x0 = clampIndex(x, s.width), x1 = clampIndex(x + 1, s.width);
        const int y0 = clampIndex(y, s.height), y1 = clampIndex(y + 1, s.height);
        const double fx = fractionOf(xs[i]), fy = fractionOf(ys[i]);
        const T *p00 = pixelAt<T, C>(s, x0, y0), *p01 = pixelAt<T, C>(s, x1, y0);
        const T *p10 = pixelAt<T, C>(s, x0, y1), *p11 = pixelAt<T, C>(s, x1, y1);
        for (int k = 0; k < C; ++k) {
            const double top = (1 - fx) * double(p00[k]) + fx * double(p01[k]);
            const double bottom = (1 - fx) * double(p10[k]) + fx * double(p11[k]);
            d[i * C + k] = storedValue<T>((1 - fy) * top + fy * bottom);
        }
    }
}

// Catmull-Rom weights of the pixels at -1, 0, 1, 2 from the one left of t.
inline void catmullRom(double t, double w[4]) {
    const double t2 = t * t, t3 = t2 * t;
    w[0] = 0.5 * (-t3 + 2 * t2 - t);
    w[1] = 0.5 * (3 * t3 - 5 * t2 + 2);
    w[2] = 0.5 * (-3 * t3 + 4 * t2 + t);
    w[3] = 0.5 * (t3 - t2);
}

template <class T, int C>
void sampleCubic(const Source& s, Positions xs, Positions ys, int n, uint8_t* dst) {
    T* d = reinterpret_cast<T*>(dst);
    for (int i = 0; i < n; ++i) {
        const int64_t x = xs[i] >> 32, y = ys[i] >> 32;
        double wx[4], wy[4];
        catmullRom(fractionOf(xs[i]), wx);
        catmullRom(fractionOf(ys[i]), wy);
        int cols[4];
        for (int j = 0; j < 4; ++j) cols[j] = clampIndex(x - 1 + j, s.width);
        double v[C] = {};
        for (int r = 0; r < 4; ++r) {
            const T* row = pixelAt<T, C>(s, 0, clampIndex(y - 1 + r, s.height));
            for (int k = 0; k < C; ++k) {
                double h = 0;
                for (int j = 0; j < 4; ++j) h += wx[j] * double(row[cols[j] * C + k]);
                v[k] += wy[r] * h;
            }
        }
        for (int k = 0; k < C; ++k) d[i * C + k] = storedValue<T>(v[k]);
    }
}

// ---- 8-bit linear in fixed point --------------------------------------------------------
// With f and g the 14-bit fractions of x and y (the low words shifted right
// by 18) and a, b, c, d the pixels at (x0, y0), (x0 + 1, y0), (x0, y0 + 1),
// (x0 + 1, y0 + 1):
//   top = a (16384 - f) + b f,   bottom = c (16384 - f) + d f
//   v = ((top + 64) >> 7) (16384 - g) + ((bottom + 64) >> 7) g
//   result = (v + 2^20) >> 21
// The positions come clamped into [0, linearLimit(width)] (likewise y), so
// that x0 + 1 is inside the ROI whenever the ROI is wider than one pixel.
// Against the exact double value: each fraction is off by less than 2^-14
// of a pixel (2^-13 where the clamp moved the point), and the value changes
// by at most 255 a pixel along either axis; the intermediate rounding adds
// 1/256: 0.07 at most before the final rounding.

inline int64_t linearLimit(int extent) {
    return extent > 1 ? (int64_t(extent - 1) << 32) - (int64_t(1) << 18) : 0;
}

template <int C>
void sampleLinear8u(const Source& s, Positions xs, Positions ys, int n, uint8_t* d) {
    const ptrdiff_t right = s.width > 1 ? C : 0, down = s.height > 1 ? s.step : 0;
    for (int i = 0; i < n; ++i) {
        const int f = int(uint32_t(xs[i]) >> 18), g = int(uint32_t(ys[i]) >> 18);
        const uint8_t* p = s.origin + (ys[i] >> 32) * s.step + (xs[i] >> 32) * C;
        for (int k = 0; k < C; ++k) {
            const int top = p[k] * (16384 - f) + p[k + right] * f;
            const int bottom = p[k + down] * (16384 - f) + p[k + down + right] * f;
            const int v = ((top + 64) >> 7) * (16384 - g) + ((bottom + 64) >> 7) * g;
            d[i * C + k] = uint8_t((v + (1 << 20)) >> 21);
        }
    }
}

#if ZOR_SIMD >= 2
// The same arithmetic on registers.  Sixteen pixels give 16 C elements,
// four to an element register whose 16-bit lanes hold the (left, right)
// pairs of its elements, top row and bottom row; pmaddwd weighs each pair
// with (16384 - f, f) of its pixel.  One-channel pixels are first gathered
// into records (the pair at (x0, y0) and the one below, two bytes each) and
// widened (SSE2); three- and four-channel pixels are loaded eight bytes at
// a time straight into registers, two pixels to one, and their pairs picked
// with pshufb (SSSE3).
namespace linear8u {

using I32 = simd::Vec<int32_t>;
using I16 = simd::Vec<int16_t>;
using U8 = simd::Vec<uint8_t>;

template <int C>
constexpr bool kSupported = C == 1 || (ZOR_SIMD >= 4 && (C == 3 || C == 4));

// (16384 - f, f) pairs of four positions.
inline I32 pairWeights(Positions p) {
    using F = simd::Vec<float>;
    using I64 = simd::Vec<int64_t>;
    const I64 base = simd::set1<I64>(p.base);
    F fractions, whole;
    simd::deinterleave(simd::bitcast<float>(base + simd::load<I64>(p.offsets)),
                       simd::bitcast<float>(base + simd::load<I64>(p.offsets + 2)), fractions, whole);
    const I32 f = simd::bitcast<int32_t>(simd::shr<18>(simd::bitcast<uint32_t>(fractions)));
    return simd::shl<16>(f) | (simd::set1<I32>(16384) - f);
}

// (pairs . weights + 64) >> 7
inline I32 rowBlend(I16 pairs, I32 weights) {
    return simd::shr<7>(simd::mulAddPairs(pairs, simd::bitcast<int16_t>(weights)) + simd::set1<I32>(64));
}

// Sixteen pixels into 16 C bytes: pairs(k, bottom) gives element register
// k's pairs, weights(w, k) its elements' weights from their group's.
template <int C, class Pairs, class Weights>
inline void blend16(Pairs pairs, Weights weights, Positions xs, Positions ys, uint8_t* out) {
    I32 wx[4], wy[4], result[4 * C];
    for (int g = 0; g < 4; ++g) wx[g] = pairWeights(xs + 4 * g), wy[g] = pairWeights(ys + 4 * g);
    const I32 half = simd::set1<I32>(1 << 20);
    for (int k = 0; k < 4 * C; k += 2) {
        const I32 wxA = weights(wx, k), wxB = weights(wx, k + 1);
        const I16 t = simd::narrowSat<int16_t>(rowBlend(pairs(k, false), wxA), rowBlend(pairs(k + 1, false), wxB));
        const I16 b = simd::narrowSat<int16_t>(rowBlend(pairs(k, true), wxA), rowBlend(pairs(k + 1, true), wxB));
        const I16 wyA = simd::bitcast<int16_t>(weights(wy, k)), wyB = simd::bitcast<int16_t>(weights(wy, k + 1));
        result[k] = simd::shr<21>(simd::mulAddPairs(simd::zipLo(t, b), wyA) + half);
        result[k + 1] = simd::shr<21>(simd::mulAddPairs(simd::zipHi(t, b), wyB) + half);
    }
    for (int q = 0; q < C; ++q) {
        const I16 lo = simd::narrowSat<int16_t>(result[4 * q], result[4 * q + 1]);
        const I16 hi = simd::narrowSat<int16_t>(result[4 * q + 2], result[4 * q + 3]);
        simd::store(out + 16 * q, simd::narrowSat<uint8_t>(lo, hi));
    }
}

// Asks for the lines that the next destination row will read from p.
inline void prefetchNextRow(const Source& s, const uint8_t* p) {
    const uintptr_t next = uintptr_t(p) + uintptr_t(s.nextRow);
    simd::prefetch<U8>(reinterpret_cast<const void*>(next));
    simd::prefetch<U8>(reinterpret_cast<const void*>(next + uintptr_t(s.step)));
}

inline const uint8_t* pairAt(const Source& s, Positions xs, Positions ys, int i, int channels) {
    return s.origin + (ys[i] >> 32) * s.step + (xs[i] >> 32) * channels;
}

// One channel: records of 64 pixels at a time.
inline void sampleC1(const Source& s, Positions xs, Positions ys, int n, uint8_t* d) {
    constexpr int kBlock = 64;
    alignas(16) uint8_t top[2 * kBlock + 32], bottom[2 * kBlock + 32], out[kBlock + 16];
    for (int i0 = 0; i0 < n; i0 += kBlock) {
        const int m = std::min(kBlock, n - i0);
        const Positions x = xs + i0, y = ys + i0;
        std::memset(top + 2 * m, 0, sizeof top - 2 * m);  // read past the block, unused
        std::memset(bottom + 2 * m, 0, sizeof bottom - 2 * m);
        for (int i = 0; i < m; ++i) {
            const uint8_t* p = pairAt(s, x, y, i, 1);
            prefetchNextRow(s, p);
            std::memcpy(top + 2 * i, p, 2);
            std::memcpy(bottom + 2 * i, p + s.step, 2);
        }
        for (int g = 0; g < m; g += 16) {
            const auto pairs = [&](int k, bool below) {
                return simd::bitcast<int16_t>(simd::widenLo(simd::load<U8>((below ? bottom : top) + 2 * g + 8 * k)));
            };
            blend16<1>(pairs, [](const I32(&w)[4], int k) { return w[k]; }, x + g, y + g, out + g);
        }
        std::memcpy(d + i0, out, size_t(m));
    }
}

#if ZOR_SIMD >= 4
constexpr uint8_t Z = 0x80;  // a zero byte in a shuffle

// Three and four channels: eight bytes a pixel, two pixels to a register
// (01: pixels 0 and 1 of a group of four, 23: pixels 2 and 3).  A
// three-channel pixel is loaded from two bytes before its pair, so its
// bytes are x x a0 a1 a2 b0 b1 b2.  Element register r of a group takes its
// pairs from register 01, from the middle (pixels 1 and 2) or from 23, and
// its weights from the pixels listed.
template <int C>
struct Direct;
template <>
struct Direct<3> {
    static constexpr int lead = 2;
    static constexpr int from[3] = {0, 1, 2};
    static constexpr uint8_t pairs[3][16] = {{2, Z, 5, Z, 3, Z, 6, Z, 4, Z, 7, Z, 10, Z, 13, Z},
                                             {3, Z, 6, Z, 4, Z, 7, Z, 10, Z, 13, Z, 11, Z, 14, Z},
                                             {4, Z, 7, Z, 10, Z, 13, Z, 11, Z, 14, Z, 12, Z, 15, Z}};
    static constexpr uint8_t pixel[3][4] = {{0, 0, 0, 1}, {1, 1, 2, 2}, {2, 3, 3, 3}};
};
template <>
struct Direct<4> {
    static constexpr int lead = 0;
    static constexpr int from[4] = {0, 0, 2, 2};
    static constexpr uint8_t pairs[4][16] = {{0, Z, 4, Z, 1, Z, 5, Z, 2, Z, 6, Z, 3, Z, 7, Z},
                                             {8, Z, 12, Z, 9, Z, 13, Z, 10, Z, 14, Z, 11, Z, 15, Z},
                                             {0, Z, 4, Z, 1, Z, 5, Z, 2, Z, 6, Z, 3, Z, 7, Z},
                                             {8, Z, 12, Z, 9, Z, 13, Z, 10, Z, 14, Z, 11, Z, 15, Z}};
    static constexpr uint8_t pixel[4][4] = {{0, 0, 0, 0}, {1, 1, 1, 1}, {2, 2, 2, 2}, {3, 3, 3, 3}};
};

// Byte shuffles that give each 32-bit lane of element register r the lane
// of its pixel.
template <int C>
struct Spread {
    uint8_t bytes[C][16];
    constexpr Spread() : bytes() {
        for (int r = 0; r < C; ++r)
            for (int e = 0; e < 16; ++e) bytes[r][e] = uint8_t(4 * Direct<C>::pixel[r][e / 4] + e % 4);
    }
};
template <int C>
constexpr Spread<C> kSpread{};

// The eight bytes of pixel i's pair in row p (+ step when below).  A
// three-channel pair in column 0 has no two bytes before it inside the ROI.
template <int C>
inline U8 pairBytes(const uint8_t* p, bool firstColumn) {
    if (C == 3 && firstColumn) {
        alignas(8) uint8_t b[8] = {};
        std::memcpy(b + 2, p, 6);
        return simd::loadHalf<U8>(b);
    }
    return simd::loadHalf<U8>(p - Direct<C>::lead);
}

// The lower halves of a and b in one register.
inline U8 joinHalves(U8 a, U8 b) {
    return simd::bitcast<uint8_t>(simd::zipLo(simd::bitcast<uint64_t>(a), simd::bitcast<uint64_t>(b)));
}

template <int C>
void sampleDirect(const Source& s, Positions xs, Positions ys, int n, uint8_t* d) {
    alignas(16) uint8_t out[16 * C];
    for (int i0 = 0; i0 < n; i0 += 16) {
        const int m = std::min(16, n - i0);
        const Positions x = xs + i0, y = ys + i0;
        U8 top[8], bottom[8];  // registers 01 and 23 of each group
        for (int h = 0; h < 8; ++h) {
            U8 t[2], b[2];
            for (int j = 0; j < 2; ++j) {
                const int i = std::min(2 * h + j, m - 1);  // past the run: its last pixel again
                const uint8_t* p = pairAt(s, x, y, i, C);
                prefetchNextRow(s, p);
                const bool firstColumn = (x[i] >> 32) == 0;
                t[j] = pairBytes<C>(p, firstColumn);
                b[j] = pairBytes<C>(p + s.step, firstColumn);
            }
            top[h] = joinHalves(t[0], t[1]);
            bottom[h] = joinHalves(b[0], b[1]);
        }
        const auto pairs = [&](int k, bool below) {
            const U8* regs = (below ? bottom : top) + 2 * (k / C);
            const int r = k % C, from = Direct<C>::from[r];
            const U8 src = from == 0 ? regs[0] : from == 2 ? regs[1] : simd::alignBytes<8>(regs[1], regs[0]);
            return simd::bitcast<int16_t>(simd::shuffleBytes(src, simd::load<U8>(Direct<C>::pairs[r])));
        };
        const auto weights = [](const I32(&w)[4], int k) {
            return simd::bitcast<int32_t>(
                simd::shuffleBytes(simd::bitcast<uint8_t>(w[k / C]), simd::load<U8>(kSpread<C>.bytes[k % C])));
        };
        blend16<C>(pairs, weights, x, y, out);
        std::memcpy(d + ptrdiff_t(i0) * C, out, size_t(m) * C);
    }
}
#endif

template <int C>
void sample(const Source& s, Positions xs, Positions ys, int n, uint8_t* d) {
    if constexpr (C == 1) sampleC1(s, xs, ys, n, d);
#if ZOR_SIMD >= 4
    else sampleDirect<C>(s, xs, ys, n, d);
#endif
}

}  // namespace linear8u
#endif

// The kernel of an element type, channel count and interpolation; null for
// an interpolation code that has none.  simd: whether the 8-bit linear
// kernel may take the register path (a ROI of at least 2 x 2 pixels).
template <class T, int C>
SampleRun sampleRunFor(int interpolation, bool simd) {
    switch (interpolation) {
    case InterNearest: return sampleNearest<T, C>;
    case InterCubic: return sampleCubic<T, C>;
    case InterLinear:
        if constexpr (std::is_same_v<T, uint8_t>) {
#if ZOR_SIMD >= 2
            if constexpr (linear8u::kSupported<C>)
                if (simd) return linear8u::sample<C>;
#endif
            (void)simd;
            return sampleLinear8u<C>;
        } else {
            return sampleLinear<T, C>;
        }
    default: return nullptr;
    }
}

}  // namespace
}}  // namespace zor::ZOR_NS
