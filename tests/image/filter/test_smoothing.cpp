// Smoothing filters against their definitions in exact integers or double:
// neighbourhood placement by the anchor, rounding half up, saturation, the
// Wiener noise estimate and its write-back, full convolution in its term
// order; check orders; every variant against the generic one.
#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Smoothing : public zt::VariantTest {};

using Image8 = zt::GuardedImage<uint8_t>;

// Random bytes, the extremes favoured (saturation needs them).
int pixel(std::mt19937& rng) { return rng() % 3 ? int(rng() % 256) : rng() % 2 ? 255 : 0; }

// Sum of the p-th powers over the neighbourhood of sample (x, y) of channel-interleaved img.
int64_t windowSum(const Image8& img, int x, int y, int ch, ImageSize m, ImagePoint a, int p = 1) {
    int64_t s = 0;
    for (int v = y - a.y; v < y - a.y + m.height; ++v)
        for (int u = x - a.x * ch; u < x + (m.width - a.x) * ch; u += ch) s += int64_t(std::pow(*img.at(u, v), p));
    return s;
}

// Runs call(src, dst) on a random w x h ROI (border pixels around it) and
// compares every destination sample with ref(src, x, y).
template <class Call, class Ref>
void expectFiltered(int w, int h, int ch, int border, std::mt19937& rng, Call call, Ref ref) {
    Image8 src(w * ch, h, border, 1, rng() % 2 ? zt::Guard::Before : zt::Guard::After, ch), dst(w * ch, h, 0, 3);
    src.fill([&](int, int) { return pixel(rng); });
    ASSERT_EQ(call(src, dst), StatusOk);
    EXPECT_TRUE(dst.outsideIntact());
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w * ch; ++x) ASSERT_EQ(*dst.at(x, y), ref(src, x, y)) << x << "," << y << " of " << w;
}

TEST_P(Smoothing, BoxMeansRoundHalfUpAroundTheAnchor) {
    std::mt19937 rng(1 + variant());
    const struct { ImageSize m; ImagePoint a; } masks[] = {
        {{1, 1}, {0, 0}}, {{2, 2}, {0, 1}}, {{3, 3}, {1, 1}}, {{4, 1}, {3, 0}}, {{2, 7}, {1, 6}},
        {{13, 3}, {12, 0}}, {{17, 17}, {8, 3}}, {{40, 2}, {0, 1}}};  // 8 and 4 lanes, 32-bit sums
    for (int ch : {1, 3})
        for (auto [m, a] : masks)
            for (int w : {1, 9, 37}) {
                const int64_t n = int64_t(m.width) * m.height;
                expectFiltered(w, 3, ch, std::max(m.width, m.height), rng, [&](Image8& s, Image8& d) {
                    auto f = ch == 1 ? z().zoriFilterBox_8u_C1R : z().zoriFilterBox_8u_C3R;
                    return f(s.roi(), s.step(), d.roi(), d.step(), {w, 3}, m, a);
                }, [&](const Image8& s, int x, int y) { return (windowSum(s, x, y, ch, m, a) + n / 2) / n; });
            }
    for (int side : {3, 5}) {  // Lowpass: the centred box mean; Hipass: N centre - box sum, saturated
        const ImageSize m{side, side};
        const int64_t n = side * side;
        for (auto f : {z().zoriFilterLowpass_8u_C1R, z().zoriFilterHipass_8u_C1R})
            expectFiltered(19, 2, 1, 2, rng, [&](Image8& s, Image8& d) {
                return f(s.roi(), s.step(), d.roi(), d.step(), {19, 2}, side * 11);
            }, [&](const Image8& s, int x, int y) {
                const int64_t sum = windowSum(s, x, y, 1, m, {side / 2, side / 2});
                return f == z().zoriFilterLowpass_8u_C1R ? (sum + n / 2) / n
                                                         : std::clamp<int64_t>(n * *s.at(x, y) - sum, 0, 255);
            });
    }
}

TEST_P(Smoothing, GaussWeightsAreBinomial) {
    std::mt19937 rng(2 + variant());
    const int w3[] = {1, 2, 1}, w5[] = {1, 4, 6, 4, 1};
    for (int side : {3, 5})
        for (int ch : {1, 3})
            for (int w : {1, 6, 35}) {
                const int *k = side == 3 ? w3 : w5, shift = side == 3 ? 4 : 8;
                expectFiltered(w, 4, ch, 2, rng, [&](Image8& s, Image8& d) {
                    auto f = ch == 1 ? z().zoriFilterGauss_8u_C1R : z().zoriFilterGauss_8u_C3R;
                    return f(s.roi(), s.step(), d.roi(), d.step(), {w, 4}, side * 11);
                }, [&](const Image8& s, int x, int y) {
                    int sum = 0;
                    for (int j = 0; j < side; ++j)
                        for (int i = 0; i < side; ++i) sum += k[i] * k[j] * *s.at(x + (i - side / 2) * ch, y + j - side / 2);
                    return (sum + (1 << (shift - 1))) >> shift;
                });
            }
}

TEST_P(Smoothing, WienerFollowsItsRuleAndEstimatesTheNoise) {
    std::mt19937 rng(3 + variant());
    for (auto [m, a] : {std::pair{ImageSize{3, 3}, ImagePoint{1, 1}}, {{5, 2}, {0, 1}}, {{12, 3}, {11, 2}},
                        {{260, 260}, {259, 0}}}) {  // the last: sums of squares past 2^32
        int w = m.width > 12 ? 3 : 29, h = 4, size = 0;
        const double n = m.width * m.height;
        Image8 src(w, h, m.width), dst(w, h, 0, 2);
        src.fill([&](int x, int) { return m.width > 12 ? 255 - pixel(rng) / 128 : x % 7 == 0 ? 128 : pixel(rng); });
        ASSERT_EQ(zt::api(0).zoriFilterWienerGetBufferSize({w, h}, m, 1, &size), StatusOk);
        zt::GuardedBuffer buf{size_t(size)};
        float noise = 0;
        for (float given : {0.01f, 0.3f, 0.0f, -1.0f}) {  // -1: the estimate of the 0 run given back
            noise = given < 0 ? noise : given;
            const std::vector<uint8_t> before(dst.at(0, 0), dst.at(0, h - 1) + w);
            ASSERT_EQ(z().zoriFilterWiener_8u_C1R(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, m, a, &noise,
                                                  buf.data()), StatusOk);
            EXPECT_TRUE(given >= 0 || std::equal(before.begin(), before.end(), dst.at(0, 0)));
            double meanVar = 0;
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    const double mean = windowSum(src, x, y, 1, m, a) / n, nu = noise * 65025.0;
                    const double var = windowSum(src, x, y, 1, m, a, 2) / n - mean * mean, den = std::max(var, nu);
                    meanVar += var;
                    const double e = 0.5 + (den <= 0 ? mean : mean + std::max(var - nu, 0.0) / den * (*src.at(x, y) - mean));
                    ASSERT_TRUE(std::abs(e - std::round(e)) < 1e-9 || *dst.at(x, y) == int(e)) << x << "," << y;
                }
            EXPECT_TRUE(given <= 0 || noise == given);
            EXPECT_TRUE(given != 0 || std::abs(noise - meanVar / (w * h) / 65025.0) < 1e-7);  // a fraction of 255^2
        }
    }
}

// Floats: sevenths, and +-2^30 whose products cancel (so the order of the
// terms shows); bytes: below top + 1 (small sums reach halves unsaturated).
template <class T>
std::vector<T> randomImage(ImageSize s, std::mt19937& rng, int top = 255) {
    std::vector<T> v(size_t(s.width) * s.height);
    for (T& x : v)
        x = std::is_same_v<T, float> ? rng() % 4 ? T(int(rng() % 2001) - 1000) / T(7) : T(rng() % 2 ? 1 << 30 : -(1 << 30))
                                     : T(pixel(rng) % (top + 1));
    return v;
}

// The defining sum, terms in order of j then i, in double rounded at every
// addition (exact for bytes).
template <class T>
double fullSum(const std::vector<T>& a, ImageSize sa, const std::vector<T>& k, ImageSize sk, int x, int y) {
    zor::DoublePrecisionScope fpu;
    double s = 0;
    for (int j = 0; j < sk.height; ++j)
        for (int i = 0; i < sk.width; ++i)
            if (x - i >= 0 && x - i < sa.width && y - j >= 0 && y - j < sa.height)
                s = zor::toDouble(s + double(k[j * sk.width + i]) * double(a[(y - j) * sa.width + x - i]));
    return s;
}

TEST_P(Smoothing, ConvFullIsTheDirectSum) {
    std::mt19937 rng(4 + variant());
    const std::pair<ImageSize, ImageSize> shapes[] = {
        {{1, 1}, {1, 1}}, {{20, 3}, {3, 2}}, {{3, 2}, {20, 3}}, {{9, 1}, {1, 9}}, {{31, 5}, {6, 7}}};
    for (auto [s1, s2] : shapes) {
        const int w = s1.width + s2.width - 1, h = s1.height + s2.height - 1;
        const auto a = randomImage<float>(s1, rng), k = randomImage<float>(s2, rng);
        std::vector<float> d(size_t(w) * h);
        ASSERT_EQ(z().zoriConvFull_32f_C1R(a.data(), s1.width * 4, s1, k.data(), s2.width * 4, s2, d.data(), w * 4),
                  StatusOk);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) ASSERT_EQ(d[y * w + x], zor::toFloat(fullSum(a, s1, k, s2, x, y)));
        std::vector<uint8_t> d8(d.size());
        for (int top : {255, 1}) for (int divisor : {1, 3, 4, 1000, -2}) {
            const auto a8 = randomImage<uint8_t>(s1, rng, top), k8 = randomImage<uint8_t>(s2, rng, top);
            ASSERT_EQ(z().zoriConvFull_8u_C1R(a8.data(), s1.width, s1, k8.data(), s2.width, s2, d8.data(), w, divisor),
                      StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    const int64_t s = int64_t(fullSum(a8, s1, k8, s2, x, y)), q = (2 * s + divisor) / (2 * divisor);
                    ASSERT_EQ(d8[y * w + x], std::clamp<int64_t>(q, 0, 255)) << divisor;  // half up, saturated
                }
        }
    }
    // only terms whose pixels exist: an infinite kernel value leaves the last output alone
    const float a[2] = {1, 2}, k[2] = {std::numeric_limits<float>::infinity(), 3};
    float d[3];
    ASSERT_EQ(z().zoriConvFull_32f_C1R(a, 8, {2, 1}, k, 8, {2, 1}, d, 12), StatusOk);
    EXPECT_EQ(d[2], 6.0f);
}

TEST_P(Smoothing, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[400] = {}, d[64] = {}, buf[4096] = {};
    float f[64] = {}, g[64] = {}, noise = 0.5f, bad[3] = {-0.0001f, 1.0f, std::numeric_limits<float>::quiet_NaN()};
    const uint8_t* src = s + 200;
    const ImageSize roi{4, 4}, m{3, 3};
    const auto watch = std::vector<zt::Watch>{zt::watch(d, sizeof d), zt::watch(&noise, 4)};
    zt::expectChecks(z.zoriFilterBox_8u_C3R, {src, 20, d, 12, roi, m, {1, 1}}, watch, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 0})), zt::bad(StatusBadStep, zt::arg<1>(0)),
                     zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{0, 3})),
                     zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{3, 0})),
                     zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{0, -1})),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<5>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{0, 4}), zt::arg<1>(0)));
    for (auto fn : {z.zoriFilterGauss_8u_C1R, z.zoriFilterLowpass_8u_C1R, z.zoriFilterHipass_8u_C1R})
        zt::expectChecks(fn, {src, 20, d, 12, roi, 55}, watch, zt::eachNull(),
                         zt::bad(StatusBadSize, zt::arg<4>(ImageSize{-1, 4})), zt::bad(StatusBadStep, zt::arg<3>(0)),
                         zt::bad(StatusBadMaskSize, zt::arg<5>(35)), zt::bad(StatusBadMaskSize, zt::arg<5>(0)),
                         zt::bad(StatusBadStep, zt::arg<3>(0), zt::arg<5>(0)));
    zt::expectChecks(z.zoriFilterWiener_8u_C1R, {src, 20, d, 12, roi, m, {1, 1}, &noise, buf}, watch, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 0})), zt::bad(StatusBadStep, zt::arg<1>(-1)),
                     zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{3, 0})),
                     zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{513, 512})),
                     zt::bad(StatusBadAnchor, zt::arg<6>(ImagePoint{1, 3})),
                     zt::bad(StatusBadAnchor, zt::arg<5>(ImageSize{3, 1}), zt::arg<7>(bad)),
                     zt::bad(StatusBadArgument, zt::arg<7>(bad)), zt::bad(StatusBadArgument, zt::arg<7>(bad + 1)),
                     zt::bad(StatusBadArgument, zt::arg<7>(bad + 2)));
    int size = 0;
    zt::expectChecks(z.zoriFilterWienerGetBufferSize, {roi, m, 1, &size}, {}, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<0>(ImageSize{0, 1})),
                     zt::bad(StatusBadMaskSize, zt::arg<1>(ImageSize{1, -1})),
                     zt::bad(StatusBadChannelCount, zt::arg<2>(0)),
                     zt::bad(StatusBadSize, zt::arg<0>(ImageSize{1 << 30, 1}), zt::arg<2>(4)));
    zt::expectChecks(z.zoriConvFull_32f_C1R, {f, 8, {2, 2}, g, 4, {1, 3}, f + 16, 8}, {zt::watch(f + 16, 48)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<5>(ImageSize{1, 0})),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0x7FFFFFFF, 1}), zt::arg<5>(ImageSize{2, 3})),
                     zt::bad(StatusBadStep, zt::arg<7>(0)), zt::bad(StatusBadStep, zt::arg<4>(0)));
    zt::expectChecks(z.zoriConvFull_8u_C1R, {s, 2, {2, 2}, s, 1, {1, 3}, d, 2, 1}, {zt::watch(d, sizeof d)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<2>(ImageSize{2, 0})),
                     zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusBadDivisor, zt::arg<8>(0)),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<8>(0)));
}

TEST_P(Smoothing, VariantsAgreeWithGeneric) {
    // filters: the neighbourhood of mask m at anchor a around the case's ROI
    for (auto [m, a] : {std::pair{ImageSize{5, 5}, ImagePoint{2, 2}}, {{3, 3}, {1, 1}}, {{4, 1}, {3, 0}},
                        {{11, 4}, {3, 3}}, {{20, 15}, {19, 0}}})
        for (int ch : {1, 3})
            zt::agreesWithGeneric(variant(), [&](const zt::Api& z, zt::Case& c) {
                const ImageSize r = c.roi();
                const auto s = c.inImage<uint8_t>((r.width + m.width - 1) * ch, r.height + m.height - 1);
                zt::ImageBuf<uint8_t> d[5];  // one for each filter
                for (auto& x : d) x = c.outImage<uint8_t>(r.width * ch, r.height);
                const uint8_t* p = s.p + a.y * s.step + a.x * ch;
                const int mask = m.width * 11;  // 55, 33, then unknown codes
                Status st = (ch == 1 ? z.zoriFilterBox_8u_C1R : z.zoriFilterBox_8u_C3R)(p, s.step, d[0].p, d[0].step, r, m, a);
                st += (ch == 1 ? z.zoriFilterGauss_8u_C1R : z.zoriFilterGauss_8u_C3R)(p, s.step, d[1].p, d[1].step, r, mask);
                if (ch == 3) return st;
                st += z.zoriFilterLowpass_8u_C1R(p, s.step, d[2].p, d[2].step, r, mask) +
                      z.zoriFilterHipass_8u_C1R(p, s.step, d[3].p, d[3].step, r, mask);
                float* noise = c.out<float>(1);
                *noise = c.index() % 2 ? 0.0f : 0.002f;
                int size = 0;
                zt::api(0).zoriFilterWienerGetBufferSize(r, m, 1, &size);
                uint8_t* buf = c.in<uint8_t>(size_t(size));  // scratch: not compared
                return st + z.zoriFilterWiener_8u_C1R(p, s.step, d[4].p, d[4].step, r, m, a, noise, buf);
            });
    zt::agreesWithGeneric(variant(), [&](const zt::Api& z, zt::Case& c) {
        const ImageSize s1 = c.roi(), s2{1 + c.index() % 7, 1 + c.index() % 4};
        const ImageSize o{s1.width + s2.width - 1, s1.height + s2.height - 1};
        const auto a = c.inImage<float>(s1.width, s1.height), k = c.inImage<float>(s2.width, s2.height);
        const auto d = c.outImage<float>(o.width, o.height);
        const auto a8 = c.inImage<uint8_t>(s1.width, s1.height), k8 = c.inImage<uint8_t>(s2.width, s2.height);
        const auto d8 = c.outImage<uint8_t>(o.width, o.height);
        return z.zoriConvFull_32f_C1R(k.p, k.step, s2, a.p, a.step, s1, d.p, d.step) +
               z.zoriConvFull_8u_C1R(a8.p, a8.step, s1, k8.p, k8.step, s2, d8.p, d8.step, 1 + c.index() % 300);
    });
}

}  // namespace

ZT_ALL_VARIANTS(Smoothing);
