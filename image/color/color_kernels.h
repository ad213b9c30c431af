// SIMD rows of the colour conversions.  Each converts a prefix of its row
// and returns the pixels (or blocks) done; the caller finishes the row with
// the pixel rules of color_pixels.h.
//
// Include after frame/variant.h.
#pragma once

#include <cstdint>

#include "frame/abi.h"
#include "frame/simd.h"

namespace zor { inline namespace ZOR_INLINE_NS { namespace color {

#if ZOR_SIMD >= 2
using U8 = simd::Vec<uint8_t>;
using I16 = simd::Vec<int16_t>;
using U16 = simd::Vec<uint16_t>;
using I32 = simd::Vec<int32_t>;
using U32 = simd::Vec<uint32_t>;
using F32 = simd::Vec<float>;

// The rows work on groups of 16 pixels in four quarters of four (one
// 32-bit lane per pixel), laid out for a 16-byte block: each 16-byte block
// of a register works on a group of its own, consecutive groups in
// consecutive blocks, so that every shuffle and widening (per block) keeps
// its meaning at any register width.  Loads and stores move each block
// from or to its own group (loadBlocks / storeBlocks at the group's
// stride).  A row steps kPixels pixels (16 per block); B names the register
// width where a row keeps to 16 bytes.
constexpr int kPixels = U8::kLanes;
template <class T, int B>
using Reg = simd::Vec<T, B>;

// The bytes of four 32-bit registers, saturated: lanes of quarter k to bytes 4k..4k+3.
template <int B>
inline Reg<uint8_t, B> toBytes(const Reg<int32_t, B> (&v)[4]) {
    return simd::narrowSat<uint8_t>(simd::narrowSat<int16_t>(v[0], v[1]), simd::narrowSat<int16_t>(v[2], v[3]));
}

// w0 a + w1 b for the words (a, b) of every 32-bit lane (a the lower),
// exact (modulo 2^32); a weight outside 16 bits (up to 65535 in
// magnitude) is applied as w -+ 65536 plus or minus 65536 times its word.
template <int B = U8::kBytes>
inline Reg<int16_t, B> pairWeights(int w0, int w1) {
    return simd::bitcast<int16_t>(simd::set1<Reg<int32_t, B>>(static_cast<int32_t>(uint32_t(w1) << 16 | uint16_t(w0))));
}
constexpr int inWord(int w) { return w > 32767 ? w - 65536 : w < -32768 ? w + 65536 : w; }
template <int W0, int W1, int B>
inline Reg<int32_t, B> dot(Reg<int16_t, B> p) {
    using S = Reg<int32_t, B>;
    constexpr int l0 = inWord(W0), l1 = inWord(W1);
    static_assert(W0 >= -65535 && W0 <= 65535 && W1 >= -65535 && W1 <= 65535, "weights of at most 16 bits");
    S r = simd::mulAddPairs(p, pairWeights<B>(l0, l1));
    const S words = simd::bitcast<int32_t>(p);
    const S low = simd::shl<16>(words), high = words & simd::set1<S>(int32_t(0xFFFF0000u));
    if constexpr (l0 < W0) r = r + low;
    if constexpr (l0 > W0) r = r - low;
    if constexpr (l1 < W1) r = r + high;
    if constexpr (l1 > W1) r = r - high;
    return r;
}
template <int K, int B>
inline Reg<int32_t, B> plus(Reg<int32_t, B> v) {
    if constexpr (K == 0) return v;
    else return v + simd::set1<Reg<int32_t, B>>(K);
}

// Groups of sixteen pixels of three bytes (48 bytes), handing out pairs of
// their channels as 16-bit words: pairs<A, C>(k) holds (channel A, channel
// C) of pixels 4k .. 4k+3 of each group, C < 0 gives (A, 0).  SSSE3
// shuffles each pair register straight out of the bytes; SSE2 separates the
// channels first (16-byte registers only).
#  if ZOR_SIMD >= 4
struct ByteMask {
    uint8_t m[16];
};
constexpr ByteMask pairMask(int a, int b, int at) {
    ByteMask t{};
    for (int i = 0; i < 4; ++i) {
        t.m[4 * i] = static_cast<uint8_t>(at + 3 * i + a);
        t.m[4 * i + 2] = b < 0 ? uint8_t(0x80) : static_cast<uint8_t>(at + 3 * i + b);
        t.m[4 * i + 1] = t.m[4 * i + 3] = 0x80;
    }
    return t;
}
template <int A, int B, int At>
alignas(16) inline constexpr ByteMask kPairMask = pairMask(A, B, At);
#  endif

template <int B = U8::kBytes>
class Pixels {
public:
    using Bytes = Reg<uint8_t, B>;
    explicit Pixels(const uint8_t* p) {
#  if ZOR_SIMD >= 4
        // quarters 0..2 at the start of their loads; quarter 3 from byte 4 of
        // the last 16 bytes, so that nothing past the 48 bytes is read
        for (int k = 0; k < 4; ++k) part_[k] = simd::loadBlocks<Bytes>(p + (k < 3 ? 12 * k : 32), 48);
#  else
        static_assert(B == 16, "SSE2 pixel groups fill 16-byte registers");
        simd::loadInterleaved3(p, plane_[0], plane_[1], plane_[2]);
#  endif
    }
    template <int A, int C>
    Reg<int16_t, B> pairs(int k) const {
#  if ZOR_SIMD >= 4
        const ByteMask& m = k < 3 ? kPairMask<A, C, 0> : kPairMask<A, C, 4>;
        return simd::bitcast<int16_t>(simd::shuffleBytes(part_[k], simd::loadBlocks<Bytes>(m.m, 0)));
#  else
        const Bytes c = C < 0 ? simd::zero<Bytes>() : plane_[C < 0 ? 0 : C];
        const Bytes ac = k < 2 ? simd::zipLo(plane_[A], c) : simd::zipHi(plane_[A], c);
        return simd::bitcast<int16_t>(k % 2 ? simd::widenHi(ac) : simd::widenLo(ac));
#  endif
    }

private:
#  if ZOR_SIMD >= 4
    Bytes part_[4];
#  else
    Bytes plane_[3];
#  endif
};

// Words (a, b) of pixels 4k .. 4k+3 from two byte registers of 16 pixels a block.
template <int B>
inline Reg<int16_t, B> zipWords(Reg<uint8_t, B> a, Reg<uint8_t, B> b, int k) {
    const Reg<uint8_t, B> ab = k < 2 ? simd::zipLo(a, b) : simd::zipHi(a, b);
    return simd::bitcast<int16_t>(k % 2 ? simd::widenHi(ab) : simd::widenLo(ab));
}

// Three channels of 16 pixels, four pixels (one 32-bit lane each) at a
// time, to interleaved bytes.  Saturating: the lanes are values, narrowed
// with saturation.  Otherwise they are sums whose bits 16..23 are the value
// (0 <= sum < 2^24), and SSSE3 picks those bytes straight into place.
// put(k, ...) takes quarter k of each group; SSSE3 stores quarters 0..2
// 16 bytes wide (the last 4 are the next quarter's, which overwrites them),
// quarter 3 with the end of quarter 2.
template <bool Saturating, int B = U8::kBytes>
class Interleave3 {
public:
    using Bytes = Reg<uint8_t, B>;
    using Sums = Reg<int32_t, B>;
    explicit Interleave3(uint8_t* d) : d_(d) {}
    void put(int k, Sums a, Sums b, Sums c) {
#  if ZOR_SIMD >= 4
        const int at = k == 3;
        Bytes bytes;
        if constexpr (Saturating) {
            const Bytes v = simd::narrowSat<uint8_t>(simd::narrowSat<int16_t>(a, b), simd::narrowSat<int16_t>(c, c));
            bytes = simd::shuffleBytes(v, mask(3, at));  // a0..3 b0..3 c0..3 to pixel order
        } else {
            bytes = pick(a, 0, at) | pick(b, 1, at) | pick(c, 2, at);
        }
        if (k < 3) simd::storeBlocks(d_ + 12 * k, 48, third_ = bytes);
        else simd::storeBlocks(d_ + 32, 48, simd::shiftBytesDown<8>(third_) | bytes);
#  else
        static_assert(B == 16, "SSE2 pixel groups fill 16-byte registers");
        if constexpr (!Saturating) a = simd::shr<16>(a), b = simd::shr<16>(b), c = simd::shr<16>(c);
        a_[k] = a, b_[k] = b, c_[k] = c;
        if (k == 3) simd::storeInterleaved3(d_, toBytes(a_), toBytes(b_), toBytes(c_));
#  endif
    }

private:
    uint8_t* d_;
#  if ZOR_SIMD >= 4
    // m[ch][0]: byte 2 of lane i to byte 3 i + ch (ch = 3: byte 4 ch' + i of
    // the narrowed groups to 3 i + ch'); m[ch][1]: the same 4 bytes on
    struct Masks {
        uint8_t m[4][2][16];
    };
    static constexpr Masks masks() {
        Masks t{};
        for (int ch = 0; ch < 4; ++ch)
            for (int j = 0; j < 16; ++j) {
                const bool own = j < 12 && (ch == 3 || j % 3 == ch);
                const int from = ch == 3 ? 4 * (j % 3) + j / 3 : 4 * (j / 3) + 2;
                t.m[ch][0][j] = own ? static_cast<uint8_t>(from) : uint8_t(0x80);
                t.m[ch][1][j] = j < 4 ? uint8_t(0x80) : t.m[ch][0][j - 4];
            }
        return t;
    }
    static Bytes mask(int ch, int at) {
        alignas(16) static constexpr Masks kMasks = masks();
        return simd::loadBlocks<Bytes>(kMasks.m[ch][at], 0);
    }
    static Bytes pick(Sums v, int ch, int at) { return simd::shuffleBytes(simd::bitcast<uint8_t>(v), mask(ch, at)); }
    Bytes third_;
#  else
    Sums a_[4], b_[4], c_[4];
#  endif
};

// ---- RGB to YCbCr ------------------------------------------------------------------------
// The chroma lies in 16..240, so 256 * 65536 added to its offset keeps the
// low 8 bits and makes the shifted value the byte itself.

inline int ycbcrRowSimd(const uint8_t* s, uint8_t* d, int n) {
    int x = 0;
    for (; x + kPixels <= n; x += kPixels) {
        const Pixels<> px(s + 3 * x);
        Interleave3<false> out(d + 3 * x);
        for (int k = 0; k < 4; ++k) {
            const I16 rg = px.pairs<0, 1>(k), bg = px.pairs<2, 1>(k);
            out.put(k, plus<1081344>(dot<16843, 16515>(rg) + dot<6423, 16515>(bg)),
                    plus<8421376>(dot<-9699, -19071>(rg) + dot<28770, 0>(bg)),
                    plus<8421376>(dot<28770, -24117>(rg) + dot<-4653, 0>(bg)));
        }
    }
    return x;
}

// ---- YCbCr to RGB ------------------------------------------------------------------------
// Every channel is one product sum shifted by 16, with the weights brought
// into 16 bits by scaling the words: 76284 y = 19071 (4 y),
// 104595 cr = 20919 (5 cr), 132186 cb = 22031 (6 cb) and
// -53281 cr = -10656 (5 cr) - cr.  Pairs (y, cr), (y, cb), (cb, cr) of raw
// bytes; YO and CO are the offsets taken off luma and chroma, K the forms'
// constants.
template <int YO, int CO, int KR, int KG, int KB, int B>
inline void rgbOfPairs(Reg<int16_t, B> ycr, Reg<int16_t, B> ycb, Reg<int16_t, B> cbcr, Reg<int32_t, B>& r,
                       Reg<int32_t, B>& g, Reg<int32_t, B>& b) {
    const auto scaled = [](Reg<int16_t, B> p, int sy, int sc, int oc) {
        return p * pairWeights<B>(sy, sc) - pairWeights<B>(sy * YO, sc * oc);
    };
    const Reg<int16_t, B> yr = scaled(ycr, 4, 5, CO), yb = scaled(ycb, 4, 6, CO), c = cbcr - pairWeights<B>(CO, CO);
    r = simd::shr<16>(plus<KR>(dot<19071, 20919>(yr)));
    g = simd::shr<16>(plus<KG>(dot<19071, -10656>(yr) + dot<-25690, -1>(c)));
    b = simd::shr<16>(plus<KB>(dot<19071, 22031>(yb)));
}

inline int rgbRowSimd(const uint8_t* s, uint8_t* d, int n) {
    int x = 0;
    for (; x + kPixels <= n; x += kPixels) {
        const Pixels<> px(s + 3 * x);
        Interleave3<true> out(d + 3 * x);
        for (int k = 0; k < 4; ++k) {
            I32 r, g, b;
            rgbOfPairs<16, 128, 0, 0, 0>(px.pairs<0, 2>(k), px.pairs<0, 1>(k), px.pairs<1, 2>(k), r, g, b);
            out.put(k, r, g, b);
        }
    }
    return x;
}

// 16 pixels a block from luma bytes and 8 chroma bytes each (one per pixel pair).
template <int YO, int CO, int KR, int KG, int KB, bool Bgr, int B>
inline void rgbOfPairedChroma(Reg<uint8_t, B> luma, Reg<uint8_t, B> cb8, Reg<uint8_t, B> cr8, uint8_t* d) {
    const Reg<uint8_t, B> cb = simd::zipLo(cb8, cb8), cr = simd::zipLo(cr8, cr8);
    Interleave3<true, B> out(d);
    for (int k = 0; k < 4; ++k) {
        Reg<int32_t, B> r, g, b;
        rgbOfPairs<YO, CO, KR, KG, KB>(zipWords(luma, cr, k), zipWords(luma, cb, k), zipWords(cb, cr, k), r, g, b);
        if constexpr (Bgr) out.put(k, b, g, r);
        else out.put(k, r, g, b);
    }
}

// Rows of 4:2:2 quadruples Y0 Cb Y1 Cr: the even bytes are luma, the odd
// ones alternate Cb and Cr.  16-byte registers.
inline int unpack422RowSimd(const uint8_t* s, uint8_t* d, int n) {
    using U16 = Reg<uint16_t, 16>;
    const U16 low = simd::set1<U16>(0x00FF);
    const auto evens = [&](U16 a, U16 b) {
        return simd::narrowSat<uint8_t>(simd::bitcast<int16_t>(a & low), simd::bitcast<int16_t>(b & low));
    };
    const auto odds = [&](U16 a, U16 b) {
        return simd::narrowSat<uint8_t>(simd::bitcast<int16_t>(simd::shr<8>(a)), simd::bitcast<int16_t>(simd::shr<8>(b)));
    };
    int x = 0;
    for (; x + 16 <= n; x += 16) {
        const U16 q0 = simd::loadFrom<U16>(s + 2 * x), q1 = simd::loadFrom<U16>(s + 2 * x + 16);
        const U16 chroma = simd::bitcast<uint16_t>(odds(q0, q1));  // Cb Cr Cb Cr ...
        rgbOfPairedChroma<0, 0, -14608761, 8887730, -18140365, false>(
            evens(q0, q1), evens(chroma, chroma), odds(chroma, chroma), d + 3 * x);
    }
    return x;
}

// 4:2:0 planes to BGR, one luma row: rounds to nearest (32768 before the
// shift of the centred sums).  16-byte registers.
inline int unplanar420RowSimd(const uint8_t* luma, const uint8_t* cb, const uint8_t* cr, uint8_t* d, int blocks) {
    using Bytes = Reg<uint8_t, 16>;
    int j = 0;
    for (; j + 8 <= blocks; j += 8)
        rgbOfPairedChroma<16, 128, 32768, 32768, 32768, true>(simd::load<Bytes>(luma + 2 * j), simd::loadHalf<Bytes>(cb + j),
                                                            simd::loadHalf<Bytes>(cr + j), d + 6 * j);
    return j;
}

// ---- 4:2:2 and 4:2:0 from RGB ----------------------------------------------------------

// Chroma sums (times the weights) of 16 pixels' word pairs rg and bg, a
// 32-bit lane per pixel; shifted by Shift after adding the offset K.
template <int B>
inline Reg<int32_t, B> cbSum(Reg<int16_t, B> rg, Reg<int16_t, B> bg) {
    return dot<-9699, -19071>(rg) + dot<28770, 0>(bg);
}
template <int B>
inline Reg<int32_t, B> crSum(Reg<int16_t, B> rg, Reg<int16_t, B> bg) {
    return dot<28770, -24117>(rg) + dot<-4653, 0>(bg);
}

// 16-byte registers.
inline int packed422RowSimd(const uint8_t* s, uint8_t* d, int n) {
    using I16 = Reg<int16_t, 16>;
    using I32 = Reg<int32_t, 16>;
    // luma with the rounding half on even pixels only; chroma of pair sums
    const I32 round = simd::bitcast<int32_t>(simd::zipLo(simd::set1<I32>(1081344), simd::set1<I32>(1048576)));
    int x = 0;
    for (; x + 16 <= n; x += 16) {
        const Pixels<16> px(s + 3 * x);
        I32 y[4], cbs[4], crs[4];
        for (int k = 0; k < 4; ++k) {
            const I16 rg = px.pairs<0, 1>(k), bg = px.pairs<2, 1>(k);
            y[k] = simd::shr<16>(dot<16843, 16515>(rg) + dot<6423, 16515>(bg) + round);
            cbs[k] = cbSum(rg, bg);
            crs[k] = crSum(rg, bg);
        }
        // the pair mean plus 128.5, the offset raised by 256 * 2^17
        I32 cb[2], cr[2];
        for (int h = 0; h < 2; ++h) {
            cb[h] = simd::shr<17>(plus<16842752>(simd::addPairs(cbs[2 * h], cbs[2 * h + 1])));
            cr[h] = simd::shr<17>(plus<16842752>(simd::addPairs(crs[2 * h], crs[2 * h + 1])));
        }
        const I32 pairs[4] = {simd::zipLo(cb[0], cr[0]), simd::zipHi(cb[0], cr[0]), simd::zipLo(cb[1], cr[1]),
                              simd::zipHi(cb[1], cr[1])};
        const Reg<uint8_t, 16> luma = toBytes(y), chroma = toBytes(pairs);
        simd::store(d + 2 * x, simd::zipLo(luma, chroma));
        simd::store(d + 2 * x + 16, simd::zipHi(luma, chroma));
    }
    return x;
}

// Two BGR rows to two luma rows and one row of each chroma plane, 8 blocks of
// 2 x 2 a register block at a time.  The chroma starts from the pairs' sums over the two rows
// and then over neighbouring pixels (a 32-bit lane holds a pair of 16-bit
// sums below 1021, so adding lanes adds the sums), weighted once per block.
inline int planar420RowsSimd(const uint8_t* s0, const uint8_t* s1, uint8_t* y0, uint8_t* y1, uint8_t* cb,
                             uint8_t* cr, int blocks) {
    const auto sumPairs = [](I16 a, I16 b) {
        return simd::bitcast<int16_t>(simd::addPairs(simd::bitcast<int32_t>(a), simd::bitcast<int32_t>(b)));
    };
    int j = 0;
    for (; j + kPixels / 2 <= blocks; j += kPixels / 2) {
        const Pixels<> a(s0 + 6 * j), b(s1 + 6 * j);
        I32 ya[4], yb[4], c[4];
        I16 rg[4], bg[4];
        for (int k = 0; k < 4; ++k) {
            const I16 rga = a.pairs<2, 1>(k), bga = a.pairs<0, 1>(k), rgb = b.pairs<2, 1>(k), bgb = b.pairs<0, 1>(k);
            ya[k] = simd::shr<16>(plus<1081344>(dot<16843, 16515>(rga) + dot<6423, 16515>(bga)));
            yb[k] = simd::shr<16>(plus<1081344>(dot<16843, 16515>(rgb) + dot<6423, 16515>(bgb)));
            rg[k] = rga + rgb;
            bg[k] = bga + bgb;
        }
        simd::store(y0 + 2 * j, toBytes(ya));
        simd::store(y1 + 2 * j, toBytes(yb));
        // the block mean plus 128.125, the offset raised by 256 * 2^18
        for (int h = 0; h < 2; ++h) {
            const I16 rgs = sumPairs(rg[2 * h], rg[2 * h + 1]), bgs = sumPairs(bg[2 * h], bg[2 * h + 1]);
            c[h] = simd::shr<18>(plus<33587200>(cbSum(rgs, bgs)));
            c[2 + h] = simd::shr<18>(plus<33587200>(crSum(rgs, bgs)));
        }
        // per register block: Cb of its 8 blocks, then Cr
        simd::eachBlock(toBytes(c), [&](int k, Reg<uint8_t, 16> bytes) {
            simd::storeHalf(cb + j + 8 * k, bytes);
            simd::storeHalf(cr + j + 8 * k, simd::shiftBytesDown<8>(bytes));
        });
    }
    return j;
}

// ---- grey ---------------------------------------------------------------------------------

// Weights of 16 bits (as signed values) only; others take the pixel rule.
// Below a weight sum of 4112 with no negative weight the grey is at most
// 255 and needs no wrap.
template <int SC>
inline int grayRowSimd(const uint8_t* s, uint8_t* d, int n, const uint32_t (&w)[3]) {
    int64_t sum = 0;
    bool negative = false;
    for (uint32_t v : w) {
        const int32_t sv = static_cast<int32_t>(v);
        if (sv < -32768 || sv > 32767) return 0;
        sum += sv;
        negative = negative || sv < 0;
    }
    const bool wraps = negative || sum > 4111;
    const int w0 = int32_t(w[0]), w1 = int32_t(w[1]), w2 = int32_t(w[2]);
    const I16 first = SC == 3 ? pairWeights(w0, w1) : pairWeights(w0, w2), second = SC == 3 ? pairWeights(w2, 0) : pairWeights(w1, 0);
    const U32 byteMask = simd::set1<U32>(0xFF), alternate = simd::set1<U32>(0x00FF00FF);
    int x = 0;
    for (; x + kPixels <= n; x += kPixels) {
        I32 g[4];
        if constexpr (SC == 3) {
            const Pixels<> px(s + 3 * x);
            for (int k = 0; k < 4; ++k)
                g[k] = simd::mulAddPairs(px.pairs<0, 1>(k), first) + simd::mulAddPairs(px.pairs<2, -1>(k), second);
        } else {
            // a pixel is one 32-bit lane c0 c1 c2 alpha: channels 0 and 2,
            // then 1 and alpha, as word pairs; quarter k of each group of
            // 16 pixels (64 bytes)
            for (int k = 0; k < 4; ++k) {
                const U32 p = simd::bitcast<uint32_t>(simd::loadBlocks<U8>(s + 4 * x + 16 * k, 64));
                g[k] = simd::mulAddPairs(simd::bitcast<int16_t>(p & alternate), first) +
                       simd::mulAddPairs(simd::bitcast<int16_t>(simd::shr<8>(p) & alternate), second);
            }
        }
        for (int k = 0; k < 4; ++k) {
            U32 v = simd::shr<12>(simd::bitcast<uint32_t>(g[k]));
            if (wraps) v = v & byteMask;
            g[k] = simd::bitcast<int32_t>(v);
        }
        simd::store(d + x, toBytes(g));  // groups in order: 16 bytes each
    }
    return x;
}

// ---- RGB to HSV ----------------------------------------------------------------------------
// The double formulas round x = N / D (D = 6 delta for the hue, max for the
// saturation, at most 1530) with trunc(x + 0.499999).  Rationals with such
// denominators lie at least 1/3060 from every x.5 they do not hit, far
// beyond the double rounding errors (about 2^-44 here), so the result is x
// rounded to nearest with halves down: floor((2 N' + D - 1) / (2 D)) with
// N' = 255 N.  That quotient is taken in single precision: numerator and
// denominator are below 2^24, so exact as floats, and a quotient below 256
// that is not whole lies at least 1/3060 below the next integer, while the
// division errs by at most 2^-16: truncation gives the floor.
inline I32 floorDiv(I32 num, I32 den) {
    return simd::toInt32Trunc(simd::toFloat(num) / simd::toFloat(den));
}

inline int hsvRowSimd(const uint8_t* s, uint8_t* d, int n) {
    const U8 one = simd::set1<U8>(1);
    int x = 0;
    for (; x + kPixels <= n; x += kPixels) {
        U8 r, g, b;
        simd::loadInterleaved3(s + 3 * x, r, g, b);
        const U8 mx = simd::max(simd::max(r, g), b), delta = mx - simd::min(simd::min(r, g), b);
        const U8 blue = simd::eq(b, mx), green = simd::andNot(blue, simd::eq(g, mx));
        const U8 mx1 = simd::max(mx, one);  // a black pixel divides by 1
        I32 hue[4], sat[4];
        for (int h = 0; h < 2; ++h) {  // eight pixels in 16-bit lanes
            const auto wide = [h](U8 v) { return simd::bitcast<int16_t>(h ? simd::widenHi(v) : simd::widenLo(v)); };
            const auto mask = [h](U8 v) {
                const simd::Vec<int8_t> m = simd::bitcast<int8_t>(v);
                return h ? simd::widenHi(m) : simd::widenLo(m);
            };
            const I16 rw = wide(r), gw = wide(g), bw = wide(b), dw = wide(delta);
            // 6 delta times the hue's fraction of a turn: by the sector of the maximum
            I16 red = gw - bw;
            red = red + (simd::gt(simd::zero<I16>(), red) & (dw * simd::set1<I16>(6)));
            const I16 viaGreen = simd::shl<1>(dw) + bw - rw, viaBlue = simd::shl<2>(dw) + rw - gw;
            const I16 hnum = simd::select(mask(blue), viaBlue, simd::select(mask(green), viaGreen, red));
            const I16 dw1 = simd::max(dw, simd::set1<I16>(1)), mw = wide(mx1);
            for (int q = 0; q < 2; ++q) {
                const I16 hd = q ? simd::zipHi(hnum, dw) : simd::zipLo(hnum, dw);
                const I16 hd1 = q ? simd::zipHi(hnum, dw1) : simd::zipLo(hnum, dw1);
                const I16 dm = q ? simd::zipHi(dw, mw) : simd::zipLo(dw, mw);
                hue[2 * h + q] = floorDiv(plus<-1>(dot<510, 6>(hd)), dot<0, 12>(hd1));
                sat[2 * h + q] = floorDiv(plus<-1>(dot<510, 1>(dm)), dot<0, 2>(dm));
            }
        }
        const U8 grey = simd::eq(delta, simd::zero<U8>());
        simd::storeInterleaved3(d + 3 * x, simd::andNot(grey, toBytes(hue)), toBytes(sat), mx);
    }
    return x;
}

#else
template <int SC>
inline int grayRowSimd(const uint8_t*, uint8_t*, int, const uint32_t (&)[3]) { return 0; }
inline int ycbcrRowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int rgbRowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int hsvRowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int packed422RowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int unpack422RowSimd(const uint8_t*, uint8_t*, int) { return 0; }
inline int planar420RowsSimd(const uint8_t*, const uint8_t*, uint8_t*, uint8_t*, uint8_t*, uint8_t*, int) { return 0; }
inline int unplanar420RowSimd(const uint8_t*, const uint8_t*, const uint8_t*, uint8_t*, int) { return 0; }
#endif

}}}  // namespace zor::ZOR_INLINE_NS::color
