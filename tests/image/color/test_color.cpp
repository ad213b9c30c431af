// Colour conversions on every variant: the fixed-point forms against their
// integer formulas over every input triple, the floating-point forms against
// double references, odd sizes, check orders and variant agreement.
#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class Color : public zt::VariantTest {};

int64_t floorDiv(int64_t a, int64_t b) { return a >= 0 ? a / b : -((-a + b - 1) / b); }
int clampByte(int64_t v) { return v < 0 ? 0 : v > 255 ? 255 : int(v); }
int low8(int64_t v) { return int(((v % 256) + 256) % 256); }

using C3Fn = Status(ZOR_CALL*)(const uint8_t*, int, uint8_t*, int, ImageSize);

// Every byte triple (x, y, slice) through a three-channel conversion, 256 x 256
// pixels per call, each output pixel checked by check(input, output).
template <class Check>
void everyTriple(C3Fn fn, Check check, int sliceStride = 1) {
    std::vector<uint8_t> src(3 << 16), dst(3 << 16);
    for (int c = 0; c < 256; c += sliceStride) {
        for (int i = 0; i < 65536; ++i) {
            src[3 * i] = uint8_t(i);
            src[3 * i + 1] = uint8_t(i >> 8);
            src[3 * i + 2] = uint8_t(c);
        }
        ASSERT_EQ(fn(src.data(), 768, dst.data(), 768, {256, 256}), StatusOk);
        for (int i = 0; i < 65536; ++i) ASSERT_TRUE(check(&src[3 * i], &dst[3 * i])) << i << " slice " << c;
    }
}

// got equals trunc(v + 0.499999) unless v + 0.499999 lies within 1e-7 of an
// integer, where either neighbour passes.
bool roundsLike(int got, double v) {
    const double t = v + 0.499999, k = std::floor(t);
    return got == int(k) || (t - k < 1e-7 && got == int(k) - 1) || (k + 1 - t < 1e-7 && got == int(k) + 1);
}

TEST_P(Color, YCbCrFormulasForEveryTriple) {
    everyTriple(z().zoriRGBToYCbCr_8u_C3R, [](const uint8_t* p, const uint8_t* q) {
        const int64_t r = p[0], g = p[1], b = p[2];
        return q[0] == floorDiv(16843 * r + 33030 * g + 6423 * b + 1081344, 65536) &&
               q[1] == low8(floorDiv(-9699 * r - 19071 * g + 28770 * b - 8355840, 65536)) &&
               q[2] == low8(floorDiv(28770 * r - 24117 * g - 4653 * b - 8355840, 65536));
    });
    everyTriple(z().zoriYCbCrToRGB_8u_C3R, [](const uint8_t* p, const uint8_t* q) {
        const int64_t y = p[0], cb = p[1] - 128, cr = p[2] - 128;
        return q[0] == clampByte(floorDiv(76284 * y + 104595 * cr - 1220544, 65536)) &&
               q[1] == clampByte(floorDiv(76284 * y - 25690 * cb - 53281 * cr - 1220544, 65536)) &&
               q[2] == clampByte(floorDiv(76284 * y + 132186 * cb - 1220544, 65536));
    });
    uint8_t px[6] = {255, 255, 255, 0, 0, 0}, out[6];
    ASSERT_EQ(z().zoriRGBToYCbCr_8u_C3R(px, 6, out, 6, {2, 1}), StatusOk);
    EXPECT_EQ(std::vector<int>(out, out + 6), (std::vector<int>{235, 128, 128, 16, 128, 128}));
    const uint8_t ycc[6] = {16, 128, 128, 235, 128, 128};
    ASSERT_EQ(z().zoriYCbCrToRGB_8u_C3R(ycc, 6, out, 6, {2, 1}), StatusOk);
    EXPECT_EQ(std::vector<int>(out, out + 6), (std::vector<int>{0, 0, 0, 254, 254, 254}));
}

TEST_P(Color, GreyWeightsAndWrap) {
    std::vector<uint8_t> src(4 << 16), dst(1 << 16);
    std::mt19937 rng(3);
    for (auto& v : src) v = uint8_t(rng());
    const float weights[][3] = {{0.299f, 0.587f, 0.114f}, {1, 1, 0}, {-0.25f, 1.5f, 0.75f}, {0.3f, 0.3f, 0.3f}};
    for (int form = 0; form < 9; ++form) {  // RGBToGray, then each weight set as C3 and AC4
        const float* w = form == 0 ? nullptr : weights[(form - 1) / 2];
        const int channels = form % 2 == 0 && form > 0 ? 4 : 3;
        uint32_t iw[3] = {1225, 2404, 467};
        for (int k = 0; w && k < 3; ++k) iw[k] = uint32_t(int64_t(std::trunc(double(w[k]) * 4096 + 0.5)));
        const ImageSize roi{256, 256};
        const Status st = form == 0 ? z().zoriRGBToGray_8u_C3C1R(src.data(), 768, dst.data(), 256, roi)
                          : channels == 3 ? z().zoriColorToGray_8u_C3C1R(src.data(), 768, dst.data(), 256, roi, w)
                                          : z().zoriColorToGray_8u_AC4C1R(src.data(), 1024, dst.data(), 256, roi, w);
        ASSERT_EQ(st, StatusOk);
        for (int i = 0; i < 65536; ++i) {
            const uint8_t* p = &src[channels * i];
            ASSERT_EQ(dst[i], uint8_t((iw[0] * p[0] + iw[1] * p[1] + iw[2] * p[2]) / 4096)) << form << " " << i;
        }
    }
    const uint8_t px[3] = {200, 100, 0};
    const float ones[3] = {1, 1, 0};
    ASSERT_EQ(z().zoriColorToGray_8u_C3C1R(px, 3, dst.data(), 1, {1, 1}, ones), StatusOk);
    EXPECT_EQ(dst[0], 44);  // 300 wraps
    // 16 bits: the truncated double sum modulo 2^16; default weights as floats
    const uint16_t p16[8] = {65535, 65535, 65535, 9, 1000, 2000, 3000, 7};
    uint16_t g[2];
    const auto sum = [](double a, double b, double c) { return uint16_t(int64_t(std::trunc(a + b + c))); };
    ASSERT_EQ(z().zoriColorToGray_16u_AC4C1R(p16, 16, g, 4, {2, 1}, nullptr), StatusOk);
    EXPECT_EQ(g[0], sum(0.299f * 65535.0, 0.587f * 65535.0, 0.114f * 65535.0));
    EXPECT_EQ(g[1], sum(0.299f * 1000.0, 0.587f * 2000.0, 0.114f * 3000.0));
    const float wide[3] = {2, 0, -0.5f};
    ASSERT_EQ(z().zoriColorToGray_16u_C3C1R(p16, 12, g, 4, {2, 1}, wide), StatusOk);
    EXPECT_EQ(g[0], sum(131070, 0, -32767.5));
    EXPECT_EQ(g[1], sum(18, 0, -1000));
}

// ---- floating point against double references ---------------------------------------

// H, S, V unrounded: h by the sector of the maximum (blue, then green win ties).
void hsvRef(int r, int g, int b, double* v) {
    const int mx = std::max(r, std::max(g, b)), mn = std::min(r, std::min(g, b));
    const double d = mx - mn;
    v[2] = mx;
    v[0] = v[1] = 0;
    if (mx == mn) return;
    v[1] = 255 * d / mx;
    const double h = b == mx ? 4 + (r - g) / d : g == mx ? 2 + (b - r) / d : (g - b) / d;
    v[0] = 255 * h / 6 + (h < 0 ? 255 : 0);
}

void rgbOfHsvRef(int hue, int sat, int val, double* v) {
    const double h = hue == 255 ? 0 : 6.0 * hue / 255, s = sat / 255.0, f = h - std::floor(h);
    const double v0 = val, p = v0 * (1 - s), q = v0 * (1 - s * f), t = v0 * (1 - s * (1 - f));
    const double table[6][3] = {{v0, t, p}, {q, v0, p}, {p, v0, t}, {p, q, v0}, {t, p, v0}, {v0, p, q}};
    for (int k = 0; k < 3; ++k) v[k] = sat == 0 ? val : table[int(h)][k];
}

void hlsRef(int r, int g, int b, double* v) {
    const int mx = std::max(r, std::max(g, b)), mn = std::min(r, std::min(g, b));
    const double d = mx - mn;
    v[1] = (mx + mn) / 2.0;
    v[0] = v[2] = 0;
    if (mx == mn) return;
    v[2] = 255 * d / (mx + mn <= 255 ? mx + mn : 510 - mx - mn);
    const double h = r == mx ? 60 * (g - b) / d : g == mx ? 120 + 60 * (b - r) / d : 240 + 60 * (r - g) / d;
    v[0] = (h < 0 ? h + 360 : h) * 255 / 360;
}

void rgbOfHlsRef(int hue, int lum, int sat, double* v) {
    const double h = hue * 360.0 / 255, l = lum / 255.0, s = sat / 255.0;
    const double m2 = l <= 0.5 ? l * (1 + s) : l + s - l * s, m1 = 2 * l - m2;
    const auto f = [&](double x) {
        x = x >= 360 ? x - 360 : x < 0 ? x + 360 : x;
        return x < 60 ? m1 + (m2 - m1) * x / 60 : x < 180 ? m2 : x < 240 ? m1 + (m2 - m1) * (240 - x) / 60 : m1;
    };
    const double rgb[3] = {f(h + 120), f(h), f(h - 120)};
    for (int k = 0; k < 3; ++k) v[k] = 255 * (sat == 0 ? l : rgb[k]);
}

template <class Ref>
auto roundsLikeRef(Ref ref) {
    return [ref](const uint8_t* p, const uint8_t* q) {
        double v[3];
        ref(p[0], p[1], p[2], v);
        return roundsLike(q[0], v[0]) && roundsLike(q[1], v[1]) && roundsLike(q[2], v[2]);
    };
}

TEST_P(Color, HsvHlsAgainstDoubleReferences) {
    // every triple where the SIMD rows run; one slice in 15 elsewhere
    everyTriple(z().zoriRGBToHSV_8u_C3R, roundsLikeRef(hsvRef), variant() >= 2 ? 1 : 15);
    if (variant() != 0) return;  // one entry serves every variant
    everyTriple(z().zoriHSVToRGB_8u_C3R, roundsLikeRef(rgbOfHsvRef), 5);
    everyTriple(z().zoriRGBToHLS_8u_C3R, roundsLikeRef(hlsRef), 5);
    everyTriple(z().zoriHLSToRGB_8u_C3R, roundsLikeRef(rgbOfHlsRef), 5);
    const uint8_t px[9] = {90, 90, 90, 255, 200, 100, 0, 200, 100};
    uint8_t a[9], b[9];
    ASSERT_EQ(z().zoriRGBToHSV_8u_C3R(px, 9, a, 9, {3, 1}), StatusOk);
    EXPECT_EQ(std::vector<int>(a, a + 3), (std::vector<int>{0, 0, 90}));  // grey
    a[3] = 255;  // hue 255 converts like hue 0
    ASSERT_EQ(z().zoriHSVToRGB_8u_C3R(a, 9, b, 9, {3, 1}), StatusOk);
    a[3] = 0;
    uint8_t c[9];
    ASSERT_EQ(z().zoriHSVToRGB_8u_C3R(a, 9, c, 9, {3, 1}), StatusOk);
    EXPECT_EQ(std::vector<int>(b, b + 9), std::vector<int>(c, c + 9));
}

TEST_P(Color, PhotoYccAgainstDoubleReference) {
    if (variant() != 0) return;  // one entry serves every variant
    std::mt19937 rng(9);
    std::vector<int16_t> src(3 * 4096), ycc(3 * 4096), back(3 * 4096);
    for (auto& v : src) v = int16_t(rng());
    src[0] = src[1] = src[2] = -32768;
    ASSERT_EQ(z().zoriRGBToYCC_16s_C3R(src.data(), 3 * 2 * 64, ycc.data(), 3 * 2 * 64, {64, 64}), StatusOk);
    ASSERT_EQ(z().zoriYCCToRGB_16s_C3R(ycc.data(), 3 * 2 * 64, back.data(), 3 * 2 * 64, {64, 64}), StatusOk);
    for (int i = 0; i < 4096; ++i) {
        const double r = src[3 * i] + 32768.0, g = src[3 * i + 1] + 32768.0, b = src[3 * i + 2] + 32768.0;
        const double y = 0.299 * r + 0.587 * g + 0.114 * b;
        const double fwd[3] = {0.7132668 * y, 0.43686 * (b - y) + 40092, 0.53192 * (r - y) + 35209};
        for (int k = 0; k < 3; ++k) ASSERT_TRUE(roundsLike(ycc[3 * i + k] + 32768, fwd[k])) << i << " " << k;
        const double Y = 1.3584 * (ycc[3 * i] + 32768), a = 2.2179 * (ycc[3 * i + 1] - 7324),
                     c = 1.8215 * (ycc[3 * i + 2] - 2441);
        const double inv[3] = {Y + c, Y - 0.194 * a - 0.509 * c, Y + a};
        for (int k = 0; k < 3; ++k) {
            const int got = back[3 * i + k] + 32768;
            ASSERT_TRUE(inv[k] < 0 ? got == 0 : inv[k] > 65535 ? got == 65535 : roundsLike(got, inv[k])) << i;
        }
    }
    EXPECT_EQ(ycc[0], -32768);
    EXPECT_EQ(ycc[1], 40092 - 32768);
}

// ---- 4:2:2 and 4:2:0 ----------------------------------------------------------------

int lumaRef(int64_t r, int64_t g, int64_t b, int64_t round) {
    return int(floorDiv(16843 * r + 33030 * g + 6423 * b + round, 65536));
}
// Chroma of sums over n pixels: the mean plus 128.5 (n = 4: 128.125), floored, low 8 bits.
int chromaRef(bool red, int64_t rs, int64_t gs, int64_t bs, int n) {
    const int64_t v = red ? 28770 * rs - 24117 * gs - 4653 * bs : -9699 * rs - 19071 * gs + 28770 * bs;
    return n == 4 ? low8(floorDiv(v * 8 + 65536 * 4 * 8 * 128 + 65536 * 4, 65536 * 4 * 8))
                  : low8(floorDiv(2 * v + 65536 * n * 257, 65536 * n * 2));
}
int packedRef(int k, int64_t y, int64_t cb, int64_t cr) {  // 4:2:2 inverse, chroma as stored
    const int64_t v[3] = {104595 * cr + 76284 * y - 14608761, 76284 * y - 25690 * cb - 53281 * cr + 8887730,
                          76284 * y + 132186 * cb - 18140365};
    return clampByte(floorDiv(v[k], 65536));
}

TEST_P(Color, Packed422OddWidthsAndWidthOne) {
    std::mt19937 rng(5);
    for (int w : {1, 2, 3, 7, 16, 33, 64}) {
        std::vector<uint8_t> rgb(3 * w * 2), packed(2 * w * 2), back(3 * w * 2);
        for (auto& v : rgb) v = uint8_t(rng());
        ASSERT_EQ(z().zoriRGBToYCbCr422_8u_C3C2R(rgb.data(), 3 * w, packed.data(), 2 * w, {w, 2}), StatusOk);
        for (int i = 0; i < 2 * w; ++i) {
            const uint8_t* p = &rgb[3 * i];
            const uint8_t* q = &packed[2 * i];
            const bool second = i % w % 2 == 1, single = !second && i % w == w - 1;
            ASSERT_EQ(q[0], lumaRef(p[0], p[1], p[2], second ? 1048576 : 1081344)) << w << " " << i;
            const uint8_t* a = second ? p - 3 : p;  // the pair's first pixel
            const int n = single ? 1 : 2;
            const int sr = a[0] + (n == 2 ? a[3] : 0), sg = a[1] + (n == 2 ? a[4] : 0), sb = a[2] + (n == 2 ? a[5] : 0);
            ASSERT_EQ(q[1], chromaRef(second, sr, sg, sb, n)) << w << " " << i;
        }
        ASSERT_EQ(z().zoriYCbCr422ToRGB_8u_C2C3R(packed.data(), 2 * w, back.data(), 3 * w, {w, 2}), StatusOk);
        for (int i = 0; i < 2 * w; ++i) {
            const uint8_t* q = &packed[2 * i];
            const int x = i % w;
            const int cb = w == 1 ? q[1] : x % 2 ? q[-1] : q[1];
            const int cr = w == 1 ? q[1] : x % 2 ? q[1] : x == w - 1 ? q[-1] : q[3];
            for (int k = 0; k < 3; ++k) ASSERT_EQ(back[3 * i + k], packedRef(k, q[0], cb, cr)) << w << " " << i;
        }
    }
}

TEST_P(Color, Planar420EvenPartAndStatus) {
    std::mt19937 rng(6);
    for (ImageSize roi : {ImageSize{3, 3}, ImageSize{2, 2}, ImageSize{34, 6}, ImageSize{7, 5}, ImageSize{1, 4}}) {
        const int w = roi.width, h = roi.height, cw = w / 2 + 1;
        std::vector<uint8_t> bgr(3 * w * h), planes[3] = {std::vector<uint8_t>(w * h, 7),
                                                         std::vector<uint8_t>(cw * h, 7), std::vector<uint8_t>(cw * h, 7)};
        for (auto& v : bgr) v = uint8_t(rng());
        uint8_t* const dst[3] = {planes[0].data(), planes[1].data(), planes[2].data()};
        const int steps[3] = {w, cw, cw};
        const Status odd = (w | h) & 1 ? StatusWarnOddSize : StatusOk;
        ASSERT_EQ(z().zoriBGRToYCbCr420_8u_C3P3R(bgr.data(), 3 * w, dst, steps, roi), w < 2 ? StatusBadSize : odd);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const uint8_t* p = &bgr[3 * (y * w + x)];
                const bool even = x < w / 2 * 2 && y < h / 2 * 2;
                ASSERT_EQ(planes[0][y * w + x], even ? lumaRef(p[2], p[1], p[0], 1081344) : 7) << x << " " << y;
                if (x % 2 || y % 2 || x / 2 >= cw) continue;
                int s[3] = {};
                for (int k = 0; even && k < 4; ++k)
                    for (int c = 0; c < 3; ++c) s[c] += p[3 * (k % 2) + 3 * w * (k / 2) + c];
                ASSERT_EQ(planes[1][y / 2 * cw + x / 2], even ? chromaRef(false, s[2], s[1], s[0], 4) : 7);
                ASSERT_EQ(planes[2][y / 2 * cw + x / 2], even ? chromaRef(true, s[2], s[1], s[0], 4) : 7);
            }
        // and back: every pixel of the even part from its block's chroma, rounding to nearest
        std::vector<uint8_t> back(3 * w * h, 9);
        const uint8_t* const src[3] = {planes[0].data(), planes[1].data(), planes[2].data()};
        ASSERT_EQ(z().zoriYCbCr420ToBGR_8u_P3C3R(src, steps, back.data(), 3 * w, roi), odd);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const bool even = x < w / 2 * 2 && y < h / 2 * 2;
                const int64_t Y = planes[0][y * w + x], cb = planes[1][y / 2 * cw + x / 2] - 128,
                              cr = planes[2][y / 2 * cw + x / 2] - 128;
                const int64_t v[3] = {76284 * Y + 132186 * cb, 76284 * Y - 25690 * cb - 53281 * cr,
                                      76284 * Y + 104595 * cr};
                for (int k = 0; k < 3; ++k)
                    ASSERT_EQ(back[3 * (y * w + x) + k], even ? clampByte(floorDiv(v[k] - 1187776, 65536)) : 9);
            }
    }
}

// ---- checks and agreement ------------------------------------------------------------

TEST_P(Color, ChecksInOrder) {
    uint8_t src[48] = {}, dst[48] = {}, p0[16] = {}, p1[4] = {}, p2[4] = {};
    const float w[3] = {1, 1, 1};
    zt::expectChecks(z().zoriRGBToYCbCr_8u_C3R, {src, 12, dst, 12, ImageSize{4, 4}}, {zt::watch(dst, 48)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{0, 1})),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{1, 0})),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 0})));
    zt::expectChecks(z().zoriColorToGray_8u_AC4C1R, {src, 16, dst, 4, ImageSize{3, 3}, w}, {zt::watch(dst, 48)},
                     zt::eachNull(StatusNullPointer, {5}), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{3, -1})));
    uint8_t* planes[3] = {p0, p1, p2};
    uint8_t* noPlane[3] = {p0, nullptr, p2};
    const int steps[3] = {4, 2, 2};
    zt::expectChecks(z().zoriBGRToYCbCr420_8u_C3P3R, {src, 12, planes, steps, ImageSize{4, 4}},
                     {zt::watch(p0, 16), zt::watch(p1, 4), zt::watch(p2, 4)}, zt::eachNull(),
                     zt::bad(StatusNullPointer, zt::arg<2>(noPlane), zt::arg<4>(ImageSize{1, 1})),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{1, 4})),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 1})));
    const uint8_t* in[3] = {p0, p1, p2};
    const uint8_t* noIn[3] = {p0, p1, nullptr};
    zt::expectChecks(z().zoriYCbCr420ToBGR_8u_P3C3R, {in, steps, dst, 12, ImageSize{4, 4}}, {zt::watch(dst, 48)},
                     zt::eachNull(), zt::bad(StatusNullPointer, zt::arg<2>(nullptr), zt::arg<4>(ImageSize{0, 4})),
                     zt::bad(StatusBadSize, zt::arg<0>(noIn), zt::arg<4>(ImageSize{4, 0})),  // planes after size
                     zt::bad(StatusNullPointer, zt::arg<0>(noIn)));
}

TEST_P(Color, VariantsAgreeWithGeneric) {
    using M = Status(ZOR_CALL* zt::Api::*)(const uint8_t*, int, uint8_t*, int, ImageSize);
    const struct { M fn; int in, out; } forms[] = {
        {&zt::Api::zoriRGBToYCbCr_8u_C3R, 3, 3},      {&zt::Api::zoriYCbCrToRGB_8u_C3R, 3, 3},
        {&zt::Api::zoriRGBToHSV_8u_C3R, 3, 3},        {&zt::Api::zoriRGBToGray_8u_C3C1R, 3, 1},
        {&zt::Api::zoriRGBToYCbCr422_8u_C3C2R, 3, 2}, {&zt::Api::zoriYCbCr422ToRGB_8u_C2C3R, 2, 3}};
    for (const auto& f : forms)
        zt::agreesWithGeneric(variant(), [&](const zt::Api& a, zt::Case& c) {
            const auto s = c.inImage<uint8_t>(f.in * c.roi().width, c.roi().height);
            const auto d = c.outImage<uint8_t>(f.out * c.roi().width, c.roi().height);
            return (a.*f.fn)(s.p, s.step, d.p, d.step, c.roi());
        });
    const float weights[2][3] = {{0.2f, 0.5f, 0.3f}, {-1.5f, 7.25f, 0.5f}};
    for (int k = 0; k < 4; ++k)
        zt::agreesWithGeneric(variant(), [&](const zt::Api& a, zt::Case& c) {
            const int ch = 3 + k % 2;
            const auto s = c.inImage<uint8_t>(ch * c.roi().width, c.roi().height);
            const auto d = c.outImage<uint8_t>(c.roi().width, c.roi().height);
            const auto fn = ch == 3 ? a.zoriColorToGray_8u_C3C1R : a.zoriColorToGray_8u_AC4C1R;
            return fn(s.p, s.step, d.p, d.step, c.roi(), weights[k / 2]);
        });
    zt::agreesWithGeneric(variant(), [](const zt::Api& a, zt::Case& c) {
        const ImageSize r = c.roi();
        const auto s = c.inImage<uint8_t>(3 * r.width, r.height);
        const zt::ImageBuf<uint8_t> p[3] = {c.outImage<uint8_t>(r.width, r.height),
                                            c.outImage<uint8_t>(r.width / 2, r.height / 2 + 1),
                                            c.outImage<uint8_t>(r.width / 2, r.height / 2 + 1)};
        uint8_t* const planes[3] = {p[0].p, p[1].p, p[2].p};
        const int steps[3] = {p[0].step, p[1].step, p[2].step};
        return a.zoriBGRToYCbCr420_8u_C3P3R(s.p, s.step, planes, steps, r);
    });
    zt::agreesWithGeneric(variant(), [](const zt::Api& a, zt::Case& c) {
        const ImageSize r = c.roi();
        const zt::ImageBuf<uint8_t> p[3] = {c.inImage<uint8_t>(r.width, r.height),
                                            c.inImage<uint8_t>(r.width / 2 + 1, r.height / 2 + 1),
                                            c.inImage<uint8_t>(r.width / 2 + 1, r.height / 2 + 1)};
        const uint8_t* const planes[3] = {p[0].p, p[1].p, p[2].p};
        const int steps[3] = {p[0].step, p[1].step, p[2].step};
        const auto d = c.outImage<uint8_t>(3 * r.width, r.height);
        return a.zoriYCbCr420ToBGR_8u_P3C3R(planes, steps, d.p, d.step, r);
    });
}

ZT_ALL_VARIANTS(Color);

}  // namespace
