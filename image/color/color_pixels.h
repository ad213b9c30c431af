// The colour conversions pixel by pixel: the defining formulas, used by the
// generic rows and for the pixels that the SIMD rows leave over.
//
// Include after frame/variant.h.
#pragma once

#include <cstdint>

#include "frame/abi.h"

namespace zor { inline namespace ZOR_INLINE_NS { namespace color {

inline uint8_t clampByte(int v) { return static_cast<uint8_t>(v < 0 ? 0 : v > 255 ? 255 : v); }

// ---- YCbCr, fixed point ----------------------------------------------------------
// Luma of studio range: offset 16 with the rounding half (round = 1081344)
// or without it (1048576, the second luma of a 4:2:2 pair).
inline uint8_t lumaOf(int r, int g, int b, int round = 1081344) {
    return static_cast<uint8_t>((16843 * r + 33030 * g + 6423 * b + round) >> 16);
}
// Chroma of n pixels' sums (n = 1, 2, 4), mean plus 128.5 (n = 4: 128.125),
// floored; the low 8 bits are kept.
template <int N>
struct ChromaOf {
    static constexpr int kShift = N == 1 ? 16 : N == 2 ? 17 : 18;
    static constexpr int kOffset = N == 1 ? 8355840 : N == 2 ? 16711680 : 33521664;
    static uint8_t cb(int rs, int gs, int bs) {
        return static_cast<uint8_t>((-9699 * rs - 19071 * gs + 28770 * bs - kOffset) >> kShift);
    }
    static uint8_t cr(int rs, int gs, int bs) {
        return static_cast<uint8_t>((28770 * rs - 24117 * gs - 4653 * bs - kOffset) >> kShift);
    }
};

// YCbCr to R, G, B with floor shifts: centred chroma, luma term 76284 y and
// the constant that folds the offsets (they differ by form, each as given).
struct RgbTerms {
    int r, g, b;  // the three constants
};
inline void rgbOf(int y, int cb, int cr, RgbTerms k, uint8_t* r, uint8_t* g, uint8_t* b) {
    *r = clampByte((76284 * y + 104595 * cr + k.r) >> 16);
    *g = clampByte((76284 * y - 25690 * cb - 53281 * cr + k.g) >> 16);
    *b = clampByte((76284 * y + 132186 * cb + k.b) >> 16);
}
constexpr RgbTerms kFullTerms{-1220544, -1220544, -1220544};     // chroma - 128 given
constexpr RgbTerms kHalfTerms{-1187776, -1187776, -1187776};     // 4:2:0: rounds to nearest
constexpr RgbTerms kPackedTerms{-14608761, 8887730, -18140365};  // 4:2:2: chroma as stored

// ---- grey ----------------------------------------------------------------------------
inline uint8_t weightedGray(uint32_t c0, uint32_t c1, uint32_t c2, const uint32_t (&w)[3]) {
    return static_cast<uint8_t>((w[0] * c0 + w[1] * c1 + w[2] * c2) >> 12);
}

// ---- floating point: trunc(x + 0.499999) --------------------------------------------
inline int roundStore(double x) { return static_cast<int>(x + 0.499999); }

inline void hsvOf(int r, int g, int b, uint8_t* d) {
    const int mx = r > g ? (r > b ? r : b) : (g > b ? g : b);
    const int mn = r < g ? (r < b ? r : b) : (g < b ? g : b);
    d[2] = static_cast<uint8_t>(mx);
    if (mx == 0 || mx == mn) {
        d[0] = d[1] = 0;
        return;
    }
    const double delta = mx - mn;
    d[1] = static_cast<uint8_t>(roundStore(255.0 * delta / mx));
    const double cr = (mx - r) / delta, cg = (mx - g) / delta, cb = (mx - b) / delta;
    double h = cb - cg;              // red is the maximum
    if (g == mx) h = 2.0 + cr - cb;  // then green overrides,
    if (b == mx) h = 4.0 + cg - cr;  // then blue
    h = h * 255.0 / 6.0;
    if (h < 0) h += 255.0;
    d[0] = static_cast<uint8_t>(roundStore(h));
}

inline void rgbOfHsv(int hue, int sat, int val, uint8_t* d) {
    if (sat == 0) {
        d[0] = d[1] = d[2] = static_cast<uint8_t>(val);
        return;
    }
    const double s = sat / 255.0, v = val;
    const double h = hue < 255 ? hue * 360.0 / 255.0 / 60.0 : 0.0;  // 255 wraps to 0
    const int i = static_cast<int>(h);
    const double f = h - i;
    const double p = v * (1.0 - s), q = v * (1.0 - s * f), t = v * (1.0 - s * (1.0 - f));
    const double rgb[6][3] = {{v, t, p}, {q, v, p}, {p, v, t}, {p, q, v}, {t, p, v}, {v, p, q}};
    for (int k = 0; k < 3; ++k) d[k] = static_cast<uint8_t>(roundStore(rgb[i][k]));
}

inline void hlsOf(int r8, int g8, int b8, uint8_t* d) {
    const double r = r8 / 255.0, g = g8 / 255.0, b = b8 / 255.0;
    const double mx = r > g ? (r > b ? r : b) : (g > b ? g : b);
    const double mn = r < g ? (r < b ? r : b) : (g < b ? g : b);
    const double l = (mx + mn) / 2.0;
    double h = 0.0, s = 0.0;
    if (mx != mn) {
        const double delta = mx - mn;
        s = l <= 0.5 ? delta / (mx + mn) : delta / (2.0 - mx - mn);
        if (r == mx) h = 60.0 * (g - b) / delta;
        else if (g == mx) h = 120.0 + 60.0 * (b - r) / delta;
        else h = 240.0 + 60.0 * (r - g) / delta;
        if (h < 0) h += 360.0;
    }
    d[0] = static_cast<uint8_t>(roundStore(h * 255.0 / 360.0));
    d[1] = static_cast<uint8_t>(roundStore(255.0 * l));
    d[2] = static_cast<uint8_t>(roundStore(255.0 * s));
}

// One primary of the HLS inverse at hue x (degrees, 0 <= x < 360).
inline double hlsPrimary(double m1, double m2, double x) {
    if (x < 60.0) return m1 + (m2 - m1) * x / 60.0;
    if (x < 180.0) return m2;
    if (x < 240.0) return m1 + (m2 - m1) * (240.0 - x) / 60.0;
    return m1;
}

inline void rgbOfHls(int hue, int lum, int sat, uint8_t* d) {
    const double h = hue * 360.0 / 255.0, l = lum / 255.0, s = sat / 255.0;
    double rgb[3] = {l, l, l};
    if (s != 0.0) {
        const double m2 = l <= 0.5 ? l * (1.0 + s) : l + s - l * s;
        const double m1 = 2.0 * l - m2;
        const double hr = h + 120.0 >= 360.0 ? h + 120.0 - 360.0 : h + 120.0;
        const double hb = h - 120.0 < 0.0 ? h - 120.0 + 360.0 : h - 120.0;
        rgb[0] = hlsPrimary(m1, m2, hr);
        rgb[1] = hlsPrimary(m1, m2, h);
        rgb[2] = hlsPrimary(m1, m2, hb);
    }
    for (int k = 0; k < 3; ++k) d[k] = static_cast<uint8_t>(roundStore(255.0 * rgb[k]));
}

// 16-bit Photo-YCC: stored values are offset by -32768.
inline void yccOf(const int16_t* s, int16_t* d) {
    const double r = s[0] + 32768.0, g = s[1] + 32768.0, b = s[2] + 32768.0;
    const double y = 0.299 * r + 0.587 * g + 0.114 * b;
    const int c[3] = {roundStore(0.7132668 * y), roundStore(0.43686 * (b - y) + 40092.0),
                      roundStore(0.53192 * (r - y) + 35209.0)};
    for (int k = 0; k < 3; ++k) d[k] = static_cast<int16_t>(c[k] - 32768);
}

inline void rgbOfYcc(const int16_t* s, int16_t* d) {
    const double y = 1.3584 * (s[0] + 32768.0);
    const double a = 2.2179 * (s[1] - 7324.0), b = 1.8215 * (s[2] - 2441.0);
    const double rgb[3] = {y + b, y - 0.194 * a - 0.509 * b, y + a};
    for (int k = 0; k < 3; ++k) {
        const int v = roundStore(rgb[k]);
        d[k] = static_cast<int16_t>((v < 0 ? 0 : v > 65535 ? 65535 : v) - 32768);
    }
}

}}}  // namespace zor::ZOR_INLINE_NS::color
