// The JPEG primitives' arithmetic: full-range colour formulas, the 8 x 8
// forward and inverse transforms and their SIMD forms.
//
// Include after frame/variant.h.
#pragma once

#include <cstdint>

#include "frame/abi.h"
#include "frame/simd.h"
#include "image/color/color_kernels.h"

namespace zor { inline namespace ZOR_INLINE_NS { namespace jpeg {

// ---- full-range colour (JFIF) ------------------------------------------------------

inline uint8_t lumaOf(int r, int g, int b) { return static_cast<uint8_t>((19595 * r + 38470 * g + 7471 * b + 32768) >> 16); }
// Offset 128 with a rounding term one short of a half.
inline uint8_t cbOf(int r, int g, int b) {
    return static_cast<uint8_t>((-11059 * r - 21709 * g + 32768 * b + 8421375) >> 16);
}
inline uint8_t crOf(int r, int g, int b) {
    return static_cast<uint8_t>((32768 * r - 27439 * g - 5329 * b + 8421375) >> 16);
}

// SIMD rows (prefixes, as in color_kernels.h): BGR bytes, B first.
#if ZOR_SIMD >= 2
using color::I16;
using color::I32;
using color::U16;
using color::U8;
using color::dot;
using color::kBlock;
using color::plus;
using color::toBytes;

inline I32 lumaSum(I16 rg, I16 bg) { return dot<19595, 19235>(rg) + dot<7471, 19235>(bg); }

inline int lumaRowSimd(const uint8_t* s, uint8_t* d, int n) {
    int x = 0;
    for (; x + kBlock <= n; x += kBlock) {
        const color::Pixels16 px(s + 3 * x);
        I32 y[4];
        for (int k = 0; k < 4; ++k) y[k] = simd::shr<16>(plus<32768>(lumaSum(px.pairs<2, 1>(k), px.pairs<0, 1>(k))));
        simd::store(d + x, toBytes(y));
    }
    return x;
}

inline int planesRowSimd(const uint8_t* s, uint8_t* const* d, int n) {
    int x = 0;
    for (; x + kBlock <= n; x += kBlock) {
        const color::Pixels16 px(s + 3 * x);
        I32 y[4], cb[4], cr[4];
        for (int k = 0; k < 4; ++k) {
            const I16 rg = px.pairs<2, 1>(k), bg = px.pairs<0, 1>(k);
            y[k] = simd::shr<16>(plus<32768>(lumaSum(rg, bg)));
            cb[k] = simd::shr<16>(plus<8421375>(dot<-11059, -21709>(rg) + dot<32768, 0>(bg)));
            cr[k] = simd::shr<16>(plus<8421375>(dot<32768, -27439>(rg) + dot<-5329, 0>(bg)));
        }
        simd::store(d[0] + x, toBytes(y));
        simd::store(d[1] + x, toBytes(cb));
        simd::store(d[2] + x, toBytes(cr));
    }
    return x;
}

// Sums of byte pairs as 16-bit lanes, then of the two rows, (+ 3) >> 2.
inline int sampleDownRowSimd(const uint8_t* s0, const uint8_t* s1, uint8_t* d, int n) {
    const U16 low = simd::set1<U16>(0x00FF), three = simd::set1<U16>(3);
    const auto pairSums = [&](const uint8_t* p) {
        const U16 v = simd::loadFrom<U16>(p);
        return (v & low) + simd::shr<8>(v);
    };
    int x = 0;
    for (; x + kBlock <= n; x += kBlock) {
        const U16 lo = simd::shr<2>(pairSums(s0 + 2 * x) + pairSums(s1 + 2 * x) + three);
        const U16 hi = simd::shr<2>(pairSums(s0 + 2 * x + 16) + pairSums(s1 + 2 * x + 16) + three);
        simd::store(d + x, simd::narrowSat<uint8_t>(simd::bitcast<int16_t>(lo), simd::bitcast<int16_t>(hi)));
    }
    return x;
}
#else
inline int lumaRowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int planesRowSimd(const uint8_t*, uint8_t* const*, int) { return 0; }
inline int sampleDownRowSimd(const uint8_t*, const uint8_t*, uint8_t*, int) { return 0; }
#endif

// ---- the 8 x 8 transforms -------------------------------------------------------------

// a >>> n: a / 2^n rounded half up.
template <class T>
constexpr T roundShift(T a, int n) { return (a + (T(1) << (n - 1))) >> n; }

// One forward pass over x[0..7] (stride 1) into X[0..7]: the row pass keeps
// a scale of 8, the column pass removes it (and the transform's own 8).
template <bool Column>
inline void forward8(const int* x, int* X) {
    const int t0 = x[0] + x[7], t1 = x[1] + x[6], t2 = x[2] + x[5], t3 = x[3] + x[4];
    const int e0 = t0 + t3, e3 = t0 - t3, e1 = t1 + t2, e2 = t1 - t2;
    const int z = 17734 * (e2 + e3);
    const int x2 = z + 25080 * e3, x6 = z - 60547 * e2;
    // odd part: inputs scaled by sqrt 2, two rotations, then sqrt 1/2 for X1, X7
    const int o0 = roundShift(46341 * (x[0] - x[7]), 12), o1 = roundShift(46341 * (x[1] - x[6]), 12);
    const int o2 = roundShift(46341 * (x[2] - x[5]), 12), o3 = roundShift(46341 * (x[3] - x[4]), 12);
    constexpr int kRot = Column ? 18 : 12;
    const int za = 799 * (o2 + o1), zc = 3406 * (o3 + o0);
    const int a = roundShift(za + 3218 * o2, kRot), b = roundShift(za - 4816 * o1, kRot);
    const int c = roundShift(zc - 5681 * o3, kRot), d = roundShift(zc - 1130 * o0, kRot);
    if constexpr (!Column) {
        X[0] = 8 * (e0 + e1);
        X[4] = 8 * (e0 - e1);
        X[2] = roundShift(x2, 12);
        X[6] = roundShift(x6, 12);
        X[3] = c - a;
        X[5] = b + d;
        X[1] = roundShift(46341 * (a - b + c + d), 16);
        X[7] = roundShift(46341 * (a + b + c - d), 16);
    } else {
        X[0] = roundShift(e0 + e1, 6);
        X[4] = roundShift(e0 - e1, 6);
        X[2] = roundShift(x2, 21);
        X[6] = roundShift(x6, 21);
        X[3] = roundShift(c - a, 3);
        X[5] = roundShift(b + d, 3);
        X[1] = roundShift(46341 * (a - b + c + d), 19);
        X[7] = roundShift(46341 * (a + b + c - d), 19);
    }
}

// One inverse pass (the transposed flow) over X[0..7] at stride `stride`,
// exact in 64 bits up to the rounding of the odd part before its last
// sqrt 2; results at 2^30 times the input scale, divided by 2^shift.
inline void inverse8(const int64_t* X, int stride, int64_t* x, int xStride, int shift) {
    const int64_t X0 = X[0], X1 = X[stride], X2 = X[2 * stride], X3 = X[3 * stride];
    const int64_t X4 = X[4 * stride], X5 = X[5 * stride], X6 = X[6 * stride], X7 = X[7 * stride];
    const int64_t z = 17734 * (X2 + X6);
    const int64_t e3 = z + 25080 * X2, e2 = z - 60547 * X6;  // 2^15
    const int64_t e0 = (X0 + X4) * 32768, e1 = (X0 - X4) * 32768;
    const int64_t t[4] = {e0 + e3, e1 + e2, e1 - e2, e0 - e3};
    const int64_t y1 = 46341 * X1, y7 = 46341 * X7;  // 2^16 X / sqrt 2
    const int64_t a = y1 + y7 - X3 * 65536, b = X5 * 65536 - y1 + y7;
    const int64_t c = X3 * 65536 + y1 + y7, d = X5 * 65536 + y1 - y7;
    const int64_t za = 799 * (a + b), zc = 3406 * (c + d);  // 2^28
    const int64_t o[4] = {roundShift<int64_t>(zc - 1130 * d, 13), roundShift<int64_t>(za - 4816 * b, 13),
                          roundShift<int64_t>(za + 3218 * a, 13), roundShift<int64_t>(zc - 5681 * c, 13)};
    for (int k = 0; k < 4; ++k) {
        const int64_t even = t[k] * 32768, odd = 46341 * o[k];  // 2^30
        x[k * xStride] = roundShift<int64_t>(even + odd, shift);
        x[(7 - k) * xStride] = roundShift<int64_t>(even - odd, shift);
    }
}

}}}  // namespace zor::ZOR_INLINE_NS::jpeg
