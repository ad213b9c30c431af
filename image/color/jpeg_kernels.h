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
using color::plus;
using color::toBytes;

// The rows below are laid out for 16-byte registers, 16 pixels at a time.
static_assert(U8::kBytes == 16, "JPEG rows are laid out for 16-byte registers");
constexpr int kBlock = 16;

inline I32 lumaSum(I16 rg, I16 bg) { return dot<19595, 19235>(rg) + dot<7471, 19235>(bg); }

inline int lumaRowSimd(const uint8_t* s, uint8_t* d, int n) {
    int x = 0;
    for (; x + kBlock <= n; x += kBlock) {
        const color::Pixels<> px(s + 3 * x);
        I32 y[4];
        for (int k = 0; k < 4; ++k) y[k] = simd::shr<16>(plus<32768>(lumaSum(px.pairs<2, 1>(k), px.pairs<0, 1>(k))));
        simd::store(d + x, toBytes(y));
    }
    return x;
}

inline int planesRowSimd(const uint8_t* s, uint8_t* const* d, int n) {
    int x = 0;
    for (; x + kBlock <= n; x += kBlock) {
        const color::Pixels<> px(s + 3 * x);
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
// One row of a 4:2:2 MCU: 16 BGR pixels to the luma rows of the left and
// right blocks and 8 chroma pairs, all level-shifted.
inline bool mcuRowSimd(const uint8_t* s, int16_t* left, int16_t* right, int16_t* cb, int16_t* cr) {
    const color::Pixels<> px(s);
    I32 y[4], cbs[4], crs[4];
    for (int k = 0; k < 4; ++k) {
        const I16 rg = px.pairs<2, 1>(k), bg = px.pairs<0, 1>(k);
        y[k] = simd::shr<16>(lumaSum(rg, bg)) - simd::set1<I32>(128);  // truncated, then centred
        cbs[k] = dot<-11059, -21709>(rg) + dot<32768, 0>(bg);
        crs[k] = dot<32768, -27439>(rg) + dot<-5329, 0>(bg);
    }
    const auto pairMeans = [](const I32 (&v)[4]) {
        return simd::narrowSat<int16_t>(simd::shr<17>(simd::addPairs(v[0], v[1])), simd::shr<17>(simd::addPairs(v[2], v[3])));
    };
    simd::store(left, simd::narrowSat<int16_t>(y[0], y[1]));
    simd::store(right, simd::narrowSat<int16_t>(y[2], y[3]));
    simd::store(cb, pairMeans(cbs));
    simd::store(cr, pairMeans(crs));
    return true;
}

// One row of packed pixels from an MCU: 128 added to every value and
// clamped (saturating on the way), bytes Y Cb Y Cr.
inline bool joinRowSimd(const int16_t* left, const int16_t* right, const int16_t* cb, const int16_t* cr, uint8_t* d) {
    const I16 half = simd::set1<I16>(128);
    const auto bytes = [&](const int16_t* a, const int16_t* b) {
        return simd::narrowSat<uint8_t>(simd::addSat(simd::load<I16>(a), half), simd::addSat(simd::load<I16>(b), half));
    };
    const U8 luma = bytes(left, right), chroma = bytes(cb, cr);
    const U8 pairs = simd::zipLo(chroma, simd::shiftBytesDown<8>(chroma));  // Cb0 Cr0 Cb1 Cr1 ...
    simd::store(d, simd::zipLo(luma, pairs));
    simd::store(d + 16, simd::zipHi(luma, pairs));
    return true;
}
// ---- forward DCT with quantisation, eight lanes at a time -------------------------
// The same integer steps as forward8, on 16-bit lanes: the block is
// transposed so that each register holds one input of the 1-D transform for
// all eight rows (then columns), and every product sum is formed exactly in
// 32-bit lanes by multiply-adds of paired words.

// (w0 a + w1 b [+ w2 c + w3 d]) >>> S, lane by lane, back in 16 bits.
template <int S, int W0, int W1, int W2 = 0, int W3 = 0>
inline I16 mulAddRound(I16 a, I16 b, I16 c = simd::zero<I16>(), I16 d = simd::zero<I16>()) {
    I32 half[2];
    for (int h = 0; h < 2; ++h) {
        half[h] = dot<W0, W1>(h ? simd::zipHi(a, b) : simd::zipLo(a, b));
        if constexpr (W2 != 0 || W3 != 0) half[h] = half[h] + dot<W2, W3>(h ? simd::zipHi(c, d) : simd::zipLo(c, d));
        half[h] = simd::shr<S>(plus<(1 << (S - 1))>(half[h]));
    }
    return simd::narrowSat<int16_t>(half[0], half[1]);
}

// (46341 d) >>> 12 - 11 d = (1285 d) >>> 12 for |d| < 2^14.
inline I16 sqrt2Excess(I16 d) {
#  if ZOR_SIMD >= 4
    return simd::mulHiRound(d, simd::set1<I16>(10280));  // (10280 d + 2^14) >> 15
#  else
    return mulAddRound<12, 1285, 0>(d, d);
#  endif
}

// Rows of an 8 x 8 block of 16-bit lanes become its columns.
inline void transpose8x8(I16 (&v)[8]) {
    using I64 = simd::Vec<int64_t>;
    I32 a[8], b[8];
    for (int i = 0; i < 4; ++i) {
        a[2 * i] = simd::bitcast<int32_t>(simd::zipLo(v[2 * i], v[2 * i + 1]));
        a[2 * i + 1] = simd::bitcast<int32_t>(simd::zipHi(v[2 * i], v[2 * i + 1]));
    }
    for (int i = 0; i < 2; ++i)
        for (int j = 0; j < 2; ++j) {
            b[4 * i + 2 * j] = simd::zipLo(a[4 * i + j], a[4 * i + j + 2]);
            b[4 * i + 2 * j + 1] = simd::zipHi(a[4 * i + j], a[4 * i + j + 2]);
        }
    for (int i = 0; i < 4; ++i) {
        const I64 lo = simd::bitcast<int64_t>(b[i]), hi = simd::bitcast<int64_t>(b[i + 4]);
        v[2 * i] = simd::bitcast<int16_t>(simd::zipLo(lo, hi));
        v[2 * i + 1] = simd::bitcast<int16_t>(simd::zipHi(lo, hi));
    }
}

// The row pass on x[k] = input k of every row; X[u] = output u (scale 8).
inline void forwardRows(const I16 (&x)[8], I16 (&X)[8]) {
    I16 t[4], o[4];
    for (int k = 0; k < 4; ++k) {
        t[k] = x[k] + x[7 - k];
        const I16 d = x[k] - x[7 - k];  // (46341 d) >>> 12 = 11 d + the excess
        o[k] = d * simd::set1<I16>(11) + sqrt2Excess(d);
    }
    const I16 e0 = t[0] + t[3], e3 = t[0] - t[3], e1 = t[1] + t[2], e2 = t[1] - t[2];
    X[0] = simd::shl<3>(e0 + e1);
    X[4] = simd::shl<3>(e0 - e1);
    X[2] = mulAddRound<12, 17734, 42814>(e2, e3);
    X[6] = mulAddRound<12, -42813, 17734>(e2, e3);
    const I16 a = mulAddRound<12, 4017, 799>(o[2], o[1]), b = mulAddRound<12, 799, -4017>(o[2], o[1]);
    const I16 c = mulAddRound<12, -2275, 3406>(o[3], o[0]), d = mulAddRound<12, 3406, 2276>(o[3], o[0]);
    X[3] = c - a;
    X[5] = b + d;
    X[1] = mulAddRound<16, 46341, 0>(a - b + c + d, a);
    X[7] = mulAddRound<16, 46341, 0>(a + b + c - d, a);
}

// The column pass: sums that leave 16 bits are taken in 32-bit lanes; the
// scaled odd inputs (up to 18 bits) enter as 11 d plus the excess.
inline void forwardColumns(const I16 (&x)[8], I16 (&X)[8]) {
    I16 t[4], d[4], p[4];
    for (int k = 0; k < 4; ++k) {
        t[k] = x[k] + x[7 - k];
        d[k] = x[k] - x[7 - k];
        p[k] = sqrt2Excess(d[k]);
    }
    const I16 e0 = t[0] + t[3], e3 = t[0] - t[3], e1 = t[1] + t[2], e2 = t[1] - t[2];
    X[0] = mulAddRound<6, 1, 1>(e0, e1);
    X[4] = mulAddRound<6, 1, -1>(e0, e1);
    X[2] = mulAddRound<21, 17734, 42814>(e2, e3);
    X[6] = mulAddRound<21, -42813, 17734>(e2, e3);
    // 4017 o2 + 799 o1 with o = 11 d + p, and so on
    const I16 a = mulAddRound<18, 44187, 8789, 4017, 799>(d[2], d[1], p[2], p[1]);
    const I16 b = mulAddRound<18, 8789, -44187, 799, -4017>(d[2], d[1], p[2], p[1]);
    const I16 c = mulAddRound<18, -25025, 37466, -2275, 3406>(d[3], d[0], p[3], p[0]);
    const I16 e = mulAddRound<18, 37466, 25036, 3406, 2276>(d[3], d[0], p[3], p[0]);
    const I16 four = simd::set1<I16>(4);
    X[3] = simd::shr<3>(c - a + four);
    X[5] = simd::shr<3>(b + e + four);
    X[1] = mulAddRound<19, 46341, 0>(a - b + c + e, a);
    X[7] = mulAddRound<19, 46341, 0>(a + b + c - e, a);
}

// (t x) / 2^15 rounded to nearest, ties to even, saturated; t unsigned.
inline I16 quantise(I16 x, I16 t) {
    const I16 hi = simd::mulHi(x, t) + (x & simd::gt(simd::zero<I16>(), t));  // t from 32768 on: + 65536 x
    const I16 lo = x * t;
    I32 q[2];
    for (int h = 0; h < 2; ++h) {
        const I32 prod = simd::bitcast<int32_t>(h ? simd::zipHi(lo, hi) : simd::zipLo(lo, hi));
        q[h] = simd::shr<15>(plus<16383>(prod) + (simd::shr<15>(prod) & simd::set1<I32>(1)));
    }
    return simd::narrowSat<int16_t>(q[0], q[1]);
}

inline bool dctQuantFwdSimd(const uint8_t* s, int step, int16_t* d, const uint16_t* table) {
    I16 v[8], X[8];
    for (int r = 0; r < 8; ++r)
        v[r] = simd::bitcast<int16_t>(simd::widenLo(simd::loadHalf<U8>(s + ptrdiff_t(r) * step))) - simd::set1<I16>(128);
    transpose8x8(v);
    forwardRows(v, X);
    transpose8x8(X);
    forwardColumns(X, v);
    for (int r = 0; r < 8; ++r) simd::store(d + 8 * r, quantise(v[r], simd::loadFrom<I16>(table + 8 * r)));
    return true;
}

#else
inline bool dctQuantFwdSimd(const uint8_t*, int, int16_t*, const uint16_t*) { return false; }
inline bool mcuRowSimd(const uint8_t*, int16_t*, int16_t*, int16_t*, int16_t*) { return false; }
inline bool joinRowSimd(const int16_t*, const int16_t*, const int16_t*, const int16_t*, uint8_t*) { return false; }
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
