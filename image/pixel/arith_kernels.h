// Row kernels of the pixel arithmetic family (image/pixel/arith.cpp): the
// image walk, scaled 8-bit results, Porter-Duff composition and the
// deinterlacing filter.  Elementwise operations are generic lambdas over the
// lane vocabulary: one body serves whole registers and the scalar tail, and
// the generic variant runs it on plain lanes.
//
// Include after frame/variant.h.
#pragma once

#include "frame/abi.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <tuple>
#include <type_traits>

namespace zor { inline namespace ZOR_INLINE_NS {

// ---- images as rows -------------------------------------------------------------

template <class T>
struct Plane {
    T* p;
    int step;  // bytes
};
template <class T>
Plane(T*, int) -> Plane<T>;

// row(rows of the planes..., n) for every row of the ROI, n elements a row
// (elemsPerPixel per pixel).  When every plane's rows follow each other
// without gaps the ROI is one long row.
template <class Row, class... T>
void forRows(ImageSize roi, int elemsPerPixel, Row row, Plane<T>... planes) {
    ptrdiff_t n = ptrdiff_t(roi.width) * elemsPerPixel;
    int rows = roi.height;
    if (((ptrdiff_t(planes.step) == n * ptrdiff_t(sizeof(T))) && ...)) {
        n *= rows;
        rows = 1;
    }
    for (int y = 0; y < rows; ++y) row(rowAt(planes.p, planes.step, y)..., n);
}

// dst = op(src...) element by element; the planes are the sources, then the
// destination.
template <class Op, class... Planes>
void mapImage(ImageSize roi, Op op, Planes... planes) {
    forRows(roi, 1, [&](auto... rowsAndLength) { simd::mapLanes(rowsAndLength..., op); }, planes...);
}

inline void fillImage(ImageSize roi, Plane<uint8_t> dst, uint8_t value) {
    forRows(roi, 1, [&](uint8_t* d, ptrdiff_t n) { std::memset(d, value, size_t(n)); }, dst);
}

// ---- scaled 8-bit results ----------------------------------------------------------

// f on byte lanes computed in 16-bit lanes (plain lanes: in int) and
// saturated back to bytes.
template <class F>
auto inWords(F f) {
    return [f](auto... x) {
        if constexpr ((std::is_arithmetic_v<decltype(x)> && ...))
            return saturate<uint8_t>(f(int(x)...));
        else
            return simd::narrowSat<uint8_t>(f(simd::widenLo(x)...), f(simd::widenHi(x)...));
    };
}

// r 2^-sf for 1 <= sf <= 16 and 0 <= r < 2^16, rounded to nearest with ties
// to even: the quotient goes up when the remainder exceeds half the divisor,
// or equals it and the quotient is odd.  Nothing exceeds 2^16 on the way.
inline auto roundShift(int sf) {
    const int mask = (1 << sf) - 1, half = 1 << (sf - 1);
    return [=](auto r) {
        using V = decltype(r);
        const V one = simd::set1<V>(1);
        const V q = simd::shr(r, sf);
        const V rem = r & simd::set1<V>(mask);
        return simd::select(simd::gt(rem + (q & one), simd::set1<V>(half)), q + one, q);
    };
}

// r 2^s for 1 <= s <= 8, capped at 256 (saturated to 255 later); larger
// counts saturate every non-zero r just as 8 does.
inline auto shiftUp(int s) {
    const int cap = 1 << (8 - s);
    return [=](auto r) {
        using V = decltype(r);
        return simd::shl(simd::min(r, simd::set1<V>(cap)), s);
    };
}

// dst = saturate(exact(src...) 2^-sf), exact giving the integer result as
// 16-bit lanes (0 <= r < 2^16).  Every r < 2^16 scales to 0 above 16.
template <class Exact, class... Planes>
void mapScaled(ImageSize roi, int sf, Exact exact, Planes... planes) {
    if (sf == 0) {
        mapImage(roi, inWords(exact), planes...);
    } else if (sf > 16) {
        fillImage(roi, std::get<sizeof...(Planes) - 1>(std::tie(planes...)), 0);  // the destination
    } else if (sf > 0) {
        const auto round = roundShift(sf);
        mapImage(roi, inWords([=](auto... x) { return round(exact(x...)); }), planes...);
    } else {
        const auto up = shiftUp(sf < -8 ? 8 : -sf);
        mapImage(roi, inWords([=](auto... x) { return up(exact(x...)); }), planes...);
    }
}

// ---- Porter-Duff composition ----------------------------------------------------------
// With a, b the alphas of A and B (0..255) the factors FA, FB scaled by 255;
// one body for plain lanes (int) and 16-bit registers.

template <int Type, class V>
V factorA(V, V b) {
    if constexpr (Type == AlphaIn || Type == AlphaATop) return b;
    else if constexpr (Type == AlphaOut || Type == AlphaXor) return simd::set1<V>(255) - b;
    else return simd::set1<V>(255);
}
template <int Type, class V>
V factorB(V a, V) {
    if constexpr (Type == AlphaOver || Type == AlphaATop || Type == AlphaXor) return simd::set1<V>(255) - a;
    else if constexpr (Type == AlphaPlus) return simd::set1<V>(255);
    else return simd::set1<V>(0);
}

// The definition: round-half-up of (cA a FA + cB b FB) / 255^2, saturated.
// 255^2 is odd, so no quotient lies exactly halfway.
template <int Type>
inline uint8_t composed(int cA, int cB, int a, int b) {
    const int n = cA * a * factorA<Type>(a, b) + cB * b * factorB<Type>(a, b);  // < 2^26
    return saturate<uint8_t>((n + 32512) / 65025);
}

template <int Type>
void composeRowAC4Scalar(const uint8_t* s1, const uint8_t* s2, uint8_t* d, ptrdiff_t pixels) {
    for (ptrdiff_t i = 0; i < pixels; ++i, s1 += 4, s2 += 4, d += 4) {
        const int a = s1[3], b = s2[3];
        d[0] = composed<Type>(s1[0], s2[0], a, b);
        d[1] = composed<Type>(s1[1], s2[1], a, b);
        d[2] = composed<Type>(s1[2], s2[2], a, b);
        d[3] = composed<Type>(255, 255, a, b);
    }
}

#if ZOR_SIMD >= 2
// The same in 16-bit lanes.  With P = a FA = 255 pq + pr and Q = b FB =
// 255 qq + qr (every part below 256), n = cA P + cB Q = 255 U + V1 + V2 for
// U = cA pq + cB qq, V1 = cA pr, V2 = cB qr, and since nested floors of
// quotients compose,
//   (n + 32512) / 65025 = (U + 127 + (V1 + V2 + 127) / 255) / 255.
// For every type but AlphaPlus n <= 255^3, so U and the last dividend stay
// below 65280.
// AlphaPlus: P = 255 a, Q = 255 b, and the result is (cA a + cB b + 127) / 255.
using Words = simd::Vec<uint16_t>;

template <class V>
struct Weights {
    V pq, pr, qq, qr;
};

// x / 255 for x <= 65534.
inline Words div255(Words x) { return simd::mulHi(x + simd::set1<Words>(1), simd::set1<Words>(257)); }
// (v1 + v2 + 127) / 255 for v1, v2 <= 65025: the first quotient and its
// remainder (below 255) go ahead of the second division.
inline Words sumDiv255(Words v1, Words v2) {
    const Words t = v1 + simd::set1<Words>(128);  // v1 + 127, plus the 1 that div255 adds
    const Words q1 = simd::mulHi(t, simd::set1<Words>(257));
    const Words rest = t - q1 * simd::set1<Words>(255);  // remainder + 1
    return q1 + simd::mulHi(v2 + rest, simd::set1<Words>(257));
}
inline Words oneDiv255(Words v) { return simd::mulHi(v + simd::set1<Words>(128), simd::set1<Words>(257)); }

template <int Type>
Weights<Words> weightsOf(Words a, Words b) {
    Weights<Words> w;
    const Words zero = simd::zero<Words>();
    if constexpr (Type == AlphaOver || Type == AlphaPlus) {
        w.pq = a;  // P = 255 a
        w.pr = zero;
    } else {
        const Words p = a * factorA<Type>(a, b);
        w.pq = div255(p);
        w.pr = p - w.pq * simd::set1<Words>(255);
    }
    if constexpr (Type == AlphaPlus) {
        w.qq = b;
        w.qr = zero;
    } else {
        const Words q = b * factorB<Type>(a, b);
        w.qq = div255(q);
        w.qr = q - w.qq * simd::set1<Words>(255);
    }
    return w;
}

template <int Type>
inline Words composeWords(Words cA, Words cB, const Weights<Words>& w) {
    if constexpr (Type == AlphaPlus) {
        return sumDiv255(cA * w.pq, cB * w.qq);
    } else {
        // remainders from A's weight (pr) everywhere but Over, from B's (qr) where FB is not 0
        constexpr bool kFromA = Type != AlphaOver;
        constexpr bool kFromB = Type == AlphaOver || Type == AlphaATop || Type == AlphaXor;
        Words u = cA * w.pq, v;
        if constexpr (kFromB) u = u + cB * w.qq;
        if constexpr (kFromA && kFromB) v = sumDiv255(cA * w.pr, cB * w.qr);
        else if constexpr (kFromA) v = oneDiv255(cA * w.pr);
        else v = oneDiv255(cB * w.qr);
        return simd::mulHi(u + v + simd::set1<Words>(128), simd::set1<Words>(257));
    }
}

// Results below 2^15 narrow as signed words: one pack, saturating at 255.
inline simd::Vec<uint8_t> narrowWords(Words lo, Words hi) {
    return simd::narrowSat<uint8_t>(simd::bitcast<int16_t>(lo), simd::bitcast<int16_t>(hi));
}

// Every pixel's value (held in the low half of its 32-bit lane) in all four
// 16-bit lanes of that pixel: pixels 0, 1 (lo) and 2, 3 (hi).
struct PerPixel {
    Words lo, hi;
};
inline PerPixel spread(Words v) {
    using U32 = simd::Vec<uint32_t>;
    const U32 low = simd::bitcast<uint32_t>(v), both = low | simd::shl<16>(low);
    return {simd::bitcast<uint16_t>(simd::zipLo(both, both)), simd::bitcast<uint16_t>(simd::zipHi(both, both))};
}
#endif

// One row of RGBA pixels.
template <int Type>
void composeRowAC4(const uint8_t* s1, const uint8_t* s2, uint8_t* d, ptrdiff_t pixels) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    using Bytes = simd::Vec<uint8_t>;
    using U32 = simd::Vec<uint32_t>;
    constexpr int kPixels = Bytes::kLanes / 4;
    const Bytes alpha = simd::bitcast<uint8_t>(simd::set1<U32>(0xFF000000u));
    for (; i + kPixels <= pixels; i += kPixels) {
        const Bytes x1 = simd::load<Bytes>(s1 + 4 * i), x2 = simd::load<Bytes>(s2 + 4 * i);
        // alphas in the low half of each pixel's 32-bit lane, the rest 0
        const Words a = simd::bitcast<uint16_t>(simd::shr<24>(simd::bitcast<uint32_t>(x1)));
        const Words b = simd::bitcast<uint16_t>(simd::shr<24>(simd::bitcast<uint32_t>(x2)));
        const Weights<Words> w = weightsOf<Type>(a, b);
        const PerPixel pq = spread(w.pq), pr = spread(w.pr), qq = spread(w.qq), qr = spread(w.qr);
        // the alpha byte is composed as a colour of 255 in both images
        const Bytes c1 = x1 | alpha, c2 = x2 | alpha;
        const Words lo = composeWords<Type>(simd::widenLo(c1), simd::widenLo(c2), {pq.lo, pr.lo, qq.lo, qr.lo});
        const Words hi = composeWords<Type>(simd::widenHi(c1), simd::widenHi(c2), {pq.hi, pr.hi, qq.hi, qr.hi});
        simd::store(d + 4 * i, narrowWords(lo, hi));
    }
#endif
    composeRowAC4Scalar<Type>(s1 + 4 * i, s2 + 4 * i, d + 4 * i, pixels - i);
}

// One row of n one-channel pixels with the constant alphas a, b (colour only).
template <int Type>
void composeRowC1(const uint8_t* s1, const uint8_t* s2, uint8_t* d, ptrdiff_t n, int a, int b) {
    ptrdiff_t i = 0;
#if ZOR_SIMD >= 2
    using Bytes = simd::Vec<uint8_t>;
    const Weights<Words> w = weightsOf<Type>(simd::set1<Words>(uint16_t(a)), simd::set1<Words>(uint16_t(b)));
    for (; i + Bytes::kLanes <= n; i += Bytes::kLanes) {
        const Bytes c1 = simd::load<Bytes>(s1 + i), c2 = simd::load<Bytes>(s2 + i);
        simd::store(d + i, narrowWords(composeWords<Type>(simd::widenLo(c1), simd::widenLo(c2), w),
                                       composeWords<Type>(simd::widenHi(c1), simd::widenHi(c2), w)));
    }
#endif
    for (; i < n; ++i) d[i] = composed<Type>(s1[i], s2[i], a, b);
}

// ---- deinterlacing ---------------------------------------------------------------------

// ((above + below) (256 - c) + 2 c at + 256) >> 9, c <= 256.
inline void deinterlaceRow(const uint8_t* above, const uint8_t* at, const uint8_t* below, uint8_t* d, ptrdiff_t n,
                           int c) {
    ptrdiff_t x = 0;
#if ZOR_SIMD >= 2
    using Bytes = simd::Vec<uint8_t>;
    using I16 = simd::Vec<int16_t>;
    using I32 = simd::Vec<int32_t>;
    // (outer, centre) weight pairs for (above + below, at) pairs
    const I16 weights = simd::bitcast<int16_t>(simd::set1<I32>((256 - c) | (2 * c) << 16));
    const I32 round = simd::set1<I32>(256);
    auto half = [&](Words outer, Words centre) {
        const I16 o = simd::bitcast<int16_t>(outer), m = simd::bitcast<int16_t>(centre);
        const I32 lo = simd::shr<9>(simd::mulAddPairs(simd::zipLo(o, m), weights) + round);
        const I32 hi = simd::shr<9>(simd::mulAddPairs(simd::zipHi(o, m), weights) + round);
        return simd::narrowSat<int16_t>(lo, hi);
    };
    for (; x + Bytes::kLanes <= n; x += Bytes::kLanes) {
        const Bytes a = simd::load<Bytes>(above + x), m = simd::load<Bytes>(at + x), b = simd::load<Bytes>(below + x);
        const I16 lo = half(simd::widenLo(a) + simd::widenLo(b), simd::widenLo(m));
        const I16 hi = half(simd::widenHi(a) + simd::widenHi(b), simd::widenHi(m));
        simd::store(d + x, simd::narrowSat<uint8_t>(lo, hi));
    }
#endif
    for (; x < n; ++x) d[x] = uint8_t(((above[x] + below[x]) * (256 - c) + 2 * c * at[x] + 256) >> 9);
}

}}  // namespace zor::ZOR_INLINE_NS
