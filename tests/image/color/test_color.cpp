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

// Every byte triple (x, y, slice) through a three-channel conversion, 256 x
// 256 pixels a call, each output pixel checked by check(input, output).
template <class Check>
void everyTriple(Status(ZOR_CALL* fn)(const uint8_t*, int, uint8_t*, int, ImageSize), Check check, int stride = 1) {
    std::vector<uint8_t> src(3 << 16), dst(3 << 16);
    for (int c = 0; c < 256; c += stride) {
        for (int i = 0; i < 65536; ++i) src[3 * i] = uint8_t(i), src[3 * i + 1] = uint8_t(i >> 8), src[3 * i + 2] = uint8_t(c);
        ASSERT_EQ(fn(src.data(), 768, dst.data(), 768, {256, 256}), StatusOk);
        for (int i = 0; i < 65536; ++i) ASSERT_TRUE(check(&src[3 * i], &dst[3 * i])) << i << " slice " << c;
    }
}

// got equals trunc(v + 0.499999) unless that sum lies within 1e-7 of an
// integer, where either neighbour passes.
bool roundsLike(int got, double v) {
    const double t = v + 0.499999, k = std::floor(t);
    return got == int(k) || (t - k < 1e-7 && got == int(k) - 1) || (k + 1 - t < 1e-7 && got == int(k) + 1);
}

// Luma of a pixel; chroma (the blue one, or red) of the sums of n pixels:
// the mean plus 128.5 (n = 4: 128.125), floored, low 8 bits.
int lumaRef(int64_t r, int64_t g, int64_t b, int64_t round = 1081344) {
    return int(floorDiv(16843 * r + 33030 * g + 6423 * b + round, 65536));
}
int chromaRef(bool red, int64_t rs, int64_t gs, int64_t bs, int n = 1) {
    const int64_t v = red ? 28770 * rs - 24117 * gs - 4653 * bs : -9699 * rs - 19071 * gs + 28770 * bs;
    return low8(n == 4 ? floorDiv(v * 8 + 65536 * 4 * 1025, 65536 * 4 * 8) : floorDiv(2 * v + 65536 * n * 257, 65536 * n * 2));
}
// R, G or B (k = 0, 1, 2) of a YCbCr triple, the chroma less `centre`, with the form's constant.
int rgbRef(int k, int64_t y, int64_t cb, int64_t cr, int64_t constant) {
    const int64_t v[3] = {76284 * y + 104595 * cr, 76284 * y - 25690 * cb - 53281 * cr, 76284 * y + 132186 * cb};
    return clampByte(floorDiv(v[k] + constant, 65536));
}

TEST_P(Color, YCbCrFormulasForEveryTriple) {
    const int stride = variant() == 1 ? 51 : 1;  // the SSE column shares the generic entry
    everyTriple(z().zoriRGBToYCbCr_8u_C3R, [](const uint8_t* p, const uint8_t* q) {
        return q[0] == lumaRef(p[0], p[1], p[2]) && q[1] == chromaRef(false, p[0], p[1], p[2]) &&
               q[2] == chromaRef(true, p[0], p[1], p[2]);
    }, stride);
    everyTriple(z().zoriYCbCrToRGB_8u_C3R, [](const uint8_t* p, const uint8_t* q) {
        for (int k = 0; k < 3; ++k)
            if (q[k] != rgbRef(k, p[0], p[1] - 128, p[2] - 128, -1220544)) return false;
        return true;
    }, stride);
}
TEST_P(Color, GreyWeightsAndWrap) {
    std::vector<uint8_t> src(4 << 16), dst(1 << 16);
    std::mt19937 rng(3);
    for (auto& v : src) v = uint8_t(rng());
    const float weights[][3] = {{0.299f, 0.587f, 0.114f}, {1, 1, 0}, {-0.25f, 1.5f, 0.75f}, {0.3f, 0.3f, 0.3f}};
    for (int form = 0; form < 9; ++form) {  // RGBToGray, then each weight set as C3 and as AC4
        const float* w = form == 0 ? nullptr : weights[(form - 1) / 2];
        const int ch = form % 2 == 0 && form > 0 ? 4 : 3;
        uint32_t iw[3] = {1225, 2404, 467};
        for (int k = 0; w && k < 3; ++k) iw[k] = uint32_t(int64_t(std::trunc(double(w[k]) * 4096 + 0.5)));
        const auto& fn = ch == 3 ? z().zoriColorToGray_8u_C3C1R : z().zoriColorToGray_8u_AC4C1R;
        ASSERT_EQ(form ? fn(src.data(), 256 * ch, dst.data(), 256, {256, 256}, w)
                       : z().zoriRGBToGray_8u_C3C1R(src.data(), 768, dst.data(), 256, {256, 256}), StatusOk);
        for (int i = 0; i < 65536; ++i) {
            const uint8_t* p = &src[ch * i];
            ASSERT_EQ(dst[i], uint8_t((iw[0] * p[0] + iw[1] * p[1] + iw[2] * p[2]) / 4096)) << form << " " << i;
        }
    }
    // 16 bits: the truncated double sum modulo 2^16; default weights as floats
    const uint16_t p16[8] = {65535, 65535, 65535, 9, 1000, 2000, 3000, 7};
    const float wide[3] = {2, 0, -0.5f};
    uint16_t g[2];
    const auto sum = [](double a, double b, double c) { return uint16_t(int64_t(std::trunc(a + b + c))); };
    ASSERT_EQ(z().zoriColorToGray_16u_AC4C1R(p16, 16, g, 4, {2, 1}, nullptr), StatusOk);
    EXPECT_EQ(g[0], sum(0.299f * 65535.0, 0.587f * 65535.0, 0.114f * 65535.0));
    EXPECT_EQ(g[1], sum(0.299f * 1000.0, 0.587f * 2000.0, 0.114f * 3000.0));
    ASSERT_EQ(z().zoriColorToGray_16u_C3C1R(p16, 12, g, 4, {2, 1}, wide), StatusOk);
    EXPECT_TRUE(g[0] == sum(131070, 0, -32767.5) && g[1] == sum(18, 0, -1000));
}

// ---- floating point against double references (unrounded values) ----------------------

void hsvRef(int r, int g, int b, double* v) {  // h by the sector of the maximum: blue, then green win ties
    const int mx = std::max(r, std::max(g, b)), d = mx - std::min(r, std::min(g, b));
    const double h = d == 0 ? 0 : b == mx ? 4 + double(r - g) / d : g == mx ? 2 + double(b - r) / d : double(g - b) / d;
    v[0] = 255 * h / 6 + (h < 0 ? 255 : 0), v[1] = mx ? 255.0 * d / mx : 0, v[2] = mx;
}
void rgbOfHsvRef(int hue, int sat, int val, double* v) {
    const double h = hue == 255 ? 0 : 6.0 * hue / 255, s = sat / 255.0, f = h - std::floor(h), x = val;
    const double p = x * (1 - s), q = x * (1 - s * f), t = x * (1 - s * (1 - f));
    const double rgb[6][3] = {{x, t, p}, {q, x, p}, {p, x, t}, {p, q, x}, {t, p, x}, {x, p, q}};
    for (int k = 0; k < 3; ++k) v[k] = rgb[int(h)][k];
}
void hlsRef(int r, int g, int b, double* v) {  // red wins ties
    const int mx = std::max(r, std::max(g, b)), mn = std::min(r, std::min(g, b)), d = mx - mn;
    const double h = d == 0 ? 0 : r == mx ? 60.0 * (g - b) / d : g == mx ? 120 + 60.0 * (b - r) / d : 240 + 60.0 * (r - g) / d;
    v[0] = (h < 0 ? h + 360 : h) * 255 / 360, v[1] = (mx + mn) / 2.0;
    v[2] = d == 0 ? 0 : 255.0 * d / (mx + mn <= 255 ? mx + mn : 510 - mx - mn);
}
void rgbOfHlsRef(int hue, int lum, int sat, double* v) {
    const double h = hue * 360.0 / 255, l = lum / 255.0, s = sat / 255.0;
    const double m2 = l <= 0.5 ? l * (1 + s) : l + s - l * s, m1 = 2 * l - m2;
    for (int k = 0; k < 3; ++k) {
        const double x = std::fmod(h + 480 - 120 * k, 360.0);
        v[k] = 255 * (sat == 0 ? l : x < 60 ? m1 + (m2 - m1) * x / 60 : x < 180 ? m2 : x < 240 ? m1 + (m2 - m1) * (240 - x) / 60 : m1);
    }
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
    everyTriple(z().zoriRGBToHSV_8u_C3R, roundsLikeRef(hsvRef), variant() >= 2 ? 1 : 15);  // all where SIMD runs
    if (variant() != 0) return;  // one entry serves every variant
    everyTriple(z().zoriHSVToRGB_8u_C3R, roundsLikeRef(rgbOfHsvRef), 5);
    everyTriple(z().zoriRGBToHLS_8u_C3R, roundsLikeRef(hlsRef), 5);
    everyTriple(z().zoriHLSToRGB_8u_C3R, roundsLikeRef(rgbOfHlsRef), 5);
}

TEST_P(Color, PhotoYccAgainstDoubleReference) {
    if (variant() != 0) return;  // one entry serves every variant
    std::mt19937 rng(9);
    std::vector<int16_t> src(3 * 4096, -32768), ycc(src), back(src);  // pixel 0 black
    for (size_t i = 3; i < src.size(); ++i) src[i] = int16_t(rng());
    ASSERT_EQ(z().zoriRGBToYCC_16s_C3R(src.data(), 384, ycc.data(), 384, {64, 64}), StatusOk);
    ASSERT_EQ(z().zoriYCCToRGB_16s_C3R(ycc.data(), 384, back.data(), 384, {64, 64}), StatusOk);
    for (int i = 0; i < 3 * 4096; i += 3) {
        const double r = src[i] + 32768.0, g = src[i + 1] + 32768.0, b = src[i + 2] + 32768.0, y = 0.299 * r + 0.587 * g + 0.114 * b;
        const double Y = 1.3584 * (ycc[i] + 32768), c1 = 2.2179 * (ycc[i + 1] - 7324), c2 = 1.8215 * (ycc[i + 2] - 2441);
        const double fwd[3] = {0.7132668 * y, 0.43686 * (b - y) + 40092, 0.53192 * (r - y) + 35209};
        const double inv[3] = {Y + c2, Y - 0.194 * c1 - 0.509 * c2, Y + c1};
        for (int k = 0; k < 3; ++k)
            ASSERT_TRUE(roundsLike(ycc[i + k] + 32768, fwd[k]) && (inv[k] < 0 ? back[i + k] == -32768 : inv[k] > 65535 ? back[i + k] == 32767
                                                                                                   : roundsLike(back[i + k] + 32768, inv[k]))) << i;
    }
    EXPECT_TRUE(ycc[0] == -32768 && ycc[1] == 40092 - 32768);
}

// ---- 4:2:2 and 4:2:0 ----------------------------------------------------------------------

TEST_P(Color, Packed422OddWidthsAndWidthOne) {
    std::mt19937 rng(5);
    for (int w : {1, 2, 3, 7, 16, 33, 64}) {
        std::vector<uint8_t> rgb(6 * w), packed(4 * w), back(6 * w);
        for (auto& v : rgb) v = uint8_t(rng());
        ASSERT_EQ(z().zoriRGBToYCbCr422_8u_C3C2R(rgb.data(), 3 * w, packed.data(), 2 * w, {w, 2}), StatusOk);
        ASSERT_EQ(z().zoriYCbCr422ToRGB_8u_C2C3R(packed.data(), 2 * w, back.data(), 3 * w, {w, 2}), StatusOk);
        for (int i = 0; i < 2 * w; ++i) {
            const uint8_t *p = &rgb[3 * i], *q = &packed[2 * i];
            const int x = i % w, n = x % 2 == 0 && x == w - 1 ? 1 : 2;  // a last single pixel: its own blue chroma
            const uint8_t* a = x % 2 ? p - 3 : p;  // the pair's first pixel
            ASSERT_EQ(q[0], lumaRef(p[0], p[1], p[2], x % 2 ? 1048576 : 1081344)) << w << " " << i;  // no half for the second
            ASSERT_EQ(q[1], chromaRef(x % 2, a[0] + (n - 1) * a[3 * n - 3], a[1] + (n - 1) * a[3 * n - 2], a[2] + (n - 1) * a[3 * n - 1], n)) << w << " " << i;
            // back: Cb and Cr of the pair; a single last pixel takes the Cr before it; width 1 uses its one chroma twice
            const int cb = x % 2 ? q[-1] : q[1], cr = w == 1 ? q[1] : x % 2 ? q[1] : x == w - 1 ? q[-1] : q[3];
            const int64_t k[3] = {-14608761, 8887730, -18140365};
            for (int c = 0; c < 3; ++c) ASSERT_EQ(back[3 * i + c], rgbRef(c, q[0], cb, cr, k[c])) << w << " " << i;
        }
    }
}

TEST_P(Color, Planar420EvenPartAndStatus) {
    std::mt19937 rng(6);
    for (ImageSize roi : {ImageSize{3, 3}, ImageSize{2, 2}, ImageSize{34, 6}, ImageSize{7, 5}, ImageSize{1, 4}}) {
        const int w = roi.width, h = roi.height, cw = w / 2 + 1, steps[3] = {w, cw, cw};
        std::vector<uint8_t> bgr(3 * w * h), back(3 * w * h, 9), p[3] = {std::vector<uint8_t>(w * h, 7),
                                                                            std::vector<uint8_t>(cw * h, 7), std::vector<uint8_t>(cw * h, 7)};
        for (auto& v : bgr) v = uint8_t(rng());
        uint8_t* const dst[3] = {p[0].data(), p[1].data(), p[2].data()};
        const uint8_t* const src[3] = {p[0].data(), p[1].data(), p[2].data()};
        const Status odd = (w | h) & 1 ? StatusWarnOddSize : StatusOk;
        ASSERT_EQ(z().zoriBGRToYCbCr420_8u_C3P3R(bgr.data(), 3 * w, dst, steps, roi), w < 2 ? StatusBadSize : odd);
        ASSERT_EQ(z().zoriYCbCr420ToBGR_8u_P3C3R(src, steps, back.data(), 3 * w, roi), odd);
        for (int i = 0; i < w * h; ++i) {
            const int x = i % w, y = i / w, c = y / 2 * cw + x / 2;
            const bool even = x < w / 2 * 2 && y < h / 2 * 2;
            const uint8_t* q = &bgr[3 * i];
            ASSERT_EQ(p[0][i], even ? lumaRef(q[2], q[1], q[0]) : 7) << x << " " << y;
            int s[3] = {};
            for (int k = 0; even && k < 12; ++k) s[k % 3] += bgr[3 * (i - x % 2 - y % 2 * w) + k / 6 * 3 * w + k % 6];
            ASSERT_EQ(p[1][c], even ? chromaRef(false, s[2], s[1], s[0], 4) : 7) << x << " " << y;
            ASSERT_EQ(p[2][c], even ? chromaRef(true, s[2], s[1], s[0], 4) : 7) << x << " " << y;
            for (int k = 0; k < 3; ++k)  // back: the block's chroma for each pixel, rounding to nearest
                ASSERT_EQ(back[3 * i + k], even ? rgbRef(2 - k, p[0][i], p[1][c] - 128, p[2][c] - 128, -1187776) : 9);
        }
    }
}

// ---- checks and agreement ------------------------------------------------------------

TEST_P(Color, ChecksInOrder) {
    uint8_t src[48] = {}, dst[48] = {}, p0[16] = {}, p1[4] = {}, p2[4] = {};
    zt::expectChecks(z().zoriRGBToYCbCr_8u_C3R, {src, 12, dst, 12, ImageSize{4, 4}}, {zt::watch(dst, 48)}, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{0, 1})), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{1, 0})),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 0})));
    const float w[3] = {1, 1, 1};  // the weights may be null
    zt::expectChecks(z().zoriColorToGray_8u_AC4C1R, {src, 16, dst, 4, ImageSize{3, 3}, w}, {zt::watch(dst, 48)},
                     zt::eachNull(StatusNullPointer, {5}), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{3, -1})));
    uint8_t *planes[3] = {p0, p1, p2}, *noPlane[3] = {p0, nullptr, p2};
    const int steps[3] = {4, 2, 2};
    zt::expectChecks(z().zoriBGRToYCbCr420_8u_C3P3R, {src, 12, planes, steps, ImageSize{4, 4}},
                     {zt::watch(p0, 16), zt::watch(p1, 4), zt::watch(p2, 4)}, zt::eachNull(),
                     zt::bad(StatusNullPointer, zt::arg<2>(noPlane), zt::arg<4>(ImageSize{1, 1})),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{1, 4})), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 1})));
    const uint8_t *in[3] = {p0, p1, p2}, *noIn[3] = {p0, p1, nullptr};
    zt::expectChecks(z().zoriYCbCr420ToBGR_8u_P3C3R, {in, steps, dst, 12, ImageSize{4, 4}}, {zt::watch(dst, 48)}, zt::eachNull(),
                     zt::bad(StatusNullPointer, zt::arg<2>(nullptr), zt::arg<4>(ImageSize{0, 4})),
                     zt::bad(StatusBadSize, zt::arg<0>(noIn), zt::arg<4>(ImageSize{4, 0})),  // planes after the size
                     zt::bad(StatusNullPointer, zt::arg<0>(noIn)));
}

TEST_P(Color, VariantsAgreeWithGeneric) {
    using M = Status(ZOR_CALL* zt::Api::*)(const uint8_t*, int, uint8_t*, int, ImageSize);
    const struct { M fn; int in, out; } forms[] = {
        {&zt::Api::zoriRGBToYCbCr_8u_C3R, 3, 3}, {&zt::Api::zoriYCbCrToRGB_8u_C3R, 3, 3}, {&zt::Api::zoriRGBToHSV_8u_C3R, 3, 3},
        {&zt::Api::zoriRGBToGray_8u_C3C1R, 3, 1}, {&zt::Api::zoriRGBToYCbCr422_8u_C3C2R, 3, 2}, {&zt::Api::zoriYCbCr422ToRGB_8u_C2C3R, 2, 3}};
    const float weights[2][3] = {{0.2f, 0.5f, 0.3f}, {-1.5f, 7.25f, 0.5f}};
    for (int f = 0; f < 9; ++f)  // six forms, then the weighted grey as C3 and AC4
        zt::agreesWithGeneric(variant(), [&](const zt::Api& a, zt::Case& c) {
            const ImageSize r = c.roi();
            const int in = f < 6 ? forms[f].in : 3 + f % 2, out = f < 6 ? forms[f].out : 1;
            const auto s = c.inImage<uint8_t>(in * r.width, r.height), d = c.outImage<uint8_t>(out * r.width, r.height);
            if (f < 6) return (a.*forms[f].fn)(s.p, s.step, d.p, d.step, r);
            return (in == 3 ? a.zoriColorToGray_8u_C3C1R : a.zoriColorToGray_8u_AC4C1R)(s.p, s.step, d.p, d.step, r, weights[f % 2]);
        });
    for (int form = 0; form < 2; ++form)  // 4:2:0 both ways
        zt::agreesWithGeneric(variant(), [&](const zt::Api& a, zt::Case& c) {
            const ImageSize r = c.roi();
            const auto packed = c.inImage<uint8_t>(3 * r.width, r.height), out = c.outImage<uint8_t>(3 * r.width, r.height);
            zt::ImageBuf<uint8_t> p[3] = {form ? c.inImage<uint8_t>(r.width, r.height) : c.outImage<uint8_t>(r.width, r.height)};
            for (int k = 1; k < 3; ++k) p[k] = form ? c.inImage<uint8_t>(r.width / 2 + 1, r.height / 2 + 1) : c.outImage<uint8_t>(r.width / 2 + 1, r.height / 2 + 1);
            uint8_t* const planes[3] = {p[0].p, p[1].p, p[2].p};
            const int steps[3] = {p[0].step, p[1].step, p[2].step};
            return form ? a.zoriYCbCr420ToBGR_8u_P3C3R(planes, steps, out.p, out.step, r)
                        : a.zoriBGRToYCbCr420_8u_C3P3R(packed.p, packed.step, planes, steps, r);
        });
}

ZT_ALL_VARIANTS(Color);

}  // namespace
