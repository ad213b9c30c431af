// Smoothing filters against their definitions in exact integers or double:
// neighbourhood placement by the anchor, rounding half up, saturation, the
// Wiener noise estimate and its write-back, full convolution in its term
// order; check orders; every variant against the generic one.
#include <algorithm>
#include <cmath>
#include <limits>
#include <random>
#include <vector>

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
    for (int side : {3, 5}) {
        const ImageSize m{side, side};
        const ImagePoint a{side / 2, side / 2};
        const int n = side * side;
        auto call = [&](auto f) {
            return [=](Image8& s, Image8& d) { return f(s.roi(), s.step(), d.roi(), d.step(), {19, 2}, side * 11); };
        };
        expectFiltered(19, 2, 1, 2, rng, call(z().zoriFilterLowpass_8u_C1R),
                       [&](const Image8& s, int x, int y) { return (windowSum(s, x, y, 1, m, a) + n / 2) / n; });
        expectFiltered(19, 2, 1, 2, rng, call(z().zoriFilterHipass_8u_C1R), [&](const Image8& s, int x, int y) {
            return std::clamp<int64_t>(n * *s.at(x, y) - windowSum(s, x, y, 1, m, a), 0, 255);
        });
    }
    // ties: sums 2 and 6 over 4 pixels round up
    const uint8_t four[2][2] = {{0, 1}, {1, 0}}, six[2][2] = {{1, 2}, {2, 1}};
    uint8_t out = 0;
    ASSERT_EQ(z().zoriFilterBox_8u_C1R(&four[1][1], 2, &out, 1, {1, 1}, {2, 2}, {1, 1}), StatusOk);
    EXPECT_EQ(out, 1);
    ASSERT_EQ(z().zoriFilterBox_8u_C1R(&six[1][1], 2, &out, 1, {1, 1}, {2, 2}, {1, 1}), StatusOk);
    EXPECT_EQ(out, 2);
}

TEST_P(Smoothing, GaussWeightsAreBinomial) {
    std::mt19937 rng(2 + variant());
    const int w3[] = {1, 2, 1}, w5[] = {1, 4, 6, 4, 1};
    for (int side : {3, 5})
        for (int ch : {1, 3})
            for (int w : {1, 6, 35}) {
                const int* k = side == 3 ? w3 : w5;
                const int shift = side == 3 ? 4 : 8;
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

// The Wiener rule in double straight from its statement.
double wienerRef(const Image8& s, int x, int y, ImageSize m, ImagePoint a, double noise) {
    const double n = double(m.width) * m.height, mean = windowSum(s, x, y, 1, m, a) / n;
    const double var = windowSum(s, x, y, 1, m, a, 2) / n - mean * mean, nu = noise * 65025.0;
    const double den = std::max(var, nu);
    return den <= 0 ? mean : mean + std::max(var - nu, 0.0) / den * (*s.at(x, y) - mean);
}

TEST_P(Smoothing, WienerFollowsItsRuleAndEstimatesTheNoise) {
    std::mt19937 rng(3 + variant());
    for (auto [m, a] : {std::pair{ImageSize{3, 3}, ImagePoint{1, 1}}, {{5, 2}, {0, 1}}, {{12, 3}, {11, 2}}}) {
        const int w = 29, h = 4;
        Image8 src(w, h, 12), dst(w, h, 0, 2), again(w, h);
        src.fill([&](int x, int) { return x % 7 == 0 ? 128 : pixel(rng); });
        int size = 0;
        ASSERT_EQ(zt::api(0).zoriFilterWienerGetBufferSize({w, h}, m, 1, &size), StatusOk);
        zt::GuardedBuffer buf(size_t(size), zt::Guard::After);
        for (float given : {0.0f, 0.01f, 0.3f}) {
            float noise = given;
            ASSERT_EQ(z().zoriFilterWiener_8u_C1R(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, m, a, &noise,
                                                  buf.data()), StatusOk);
            EXPECT_TRUE(dst.outsideIntact());
            double meanVar = 0;
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    const double mean = windowSum(src, x, y, 1, m, a) / double(m.width * m.height);
                    meanVar += windowSum(src, x, y, 1, m, a, 2) / double(m.width * m.height) - mean * mean;
                    const double e = wienerRef(src, x, y, m, a, noise) + 0.5;
                    if (std::abs(e - std::round(e)) > 1e-9) {  // away from a tie
                        ASSERT_EQ(*dst.at(x, y), int(std::floor(e))) << x << "," << y;
                    }
                }
            if (given == 0) {  // written back as a fraction of 255^2, and reproducible with it
                EXPECT_NEAR(noise, meanVar / (w * h) / 65025.0, 1e-7);
                ASSERT_EQ(z().zoriFilterWiener_8u_C1R(src.roi(), src.step(), again.roi(), again.step(), {w, h}, m, a,
                                                      &noise, buf.data()), StatusOk);
                for (int y = 0; y < h; ++y) ASSERT_TRUE(std::equal(dst.at(0, y), dst.at(w, y), again.at(0, y)));
            } else {
                EXPECT_EQ(noise, given);
            }
        }
    }
}

template <class T>
std::vector<T> randomImage(ImageSize s, std::mt19937& rng) {
    std::vector<T> v(size_t(s.width) * s.height);
    for (T& x : v) x = std::is_same_v<T, float> ? T(int(rng() % 2001) - 1000) / T(7) : T(pixel(rng));
    return v;
}

// The defining sum, terms in order of j then i.
template <class Acc, class T>
Acc fullSum(const std::vector<T>& a, ImageSize sa, const std::vector<T>& k, ImageSize sk, int x, int y) {
    Acc s = 0;
    for (int j = 0; j < sk.height; ++j)
        for (int i = 0; i < sk.width; ++i)
            if (x - i >= 0 && x - i < sa.width && y - j >= 0 && y - j < sa.height)
                s += Acc(k[j * sk.width + i]) * Acc(a[(y - j) * sa.width + x - i]);
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
            for (int x = 0; x < w; ++x) ASSERT_EQ(d[y * w + x], float(fullSum<double>(a, s1, k, s2, x, y)));
        const auto a8 = randomImage<uint8_t>(s1, rng), k8 = randomImage<uint8_t>(s2, rng);
        std::vector<uint8_t> d8(d.size());
        for (int divisor : {1, 3, 4, 1000, -2}) {
            ASSERT_EQ(z().zoriConvFull_8u_C1R(a8.data(), s1.width, s1, k8.data(), s2.width, s2, d8.data(), w, divisor),
                      StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    const int64_t s = fullSum<int64_t>(a8, s1, k8, s2, x, y);
                    const int64_t q = divisor < 0 ? 0 : (2 * s + divisor) / (2 * divisor);  // half up
                    ASSERT_EQ(d8[y * w + x], std::min<int64_t>(q, 255)) << divisor;
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
    float f[64] = {}, g[64] = {}, noise = 0.5f, badNoise = 2.0f;
    const uint8_t* src = s + 200;
    const ImageSize roi{4, 4}, m{3, 3};
    const auto watch = std::vector<zt::Watch>{zt::watch(d, sizeof d), zt::watch(&noise, 4)};
    zt::expectChecks(z.zoriFilterBox_8u_C3R, {src, 20, d, 12, roi, m, {1, 1}}, watch, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<4>(ImageSize{4, 0})), zt::bad(StatusBadStep, zt::arg<1>(0)),
                     zt::bad(StatusBadStep, zt::arg<3>(-12)), zt::bad(StatusBadMaskSize, zt::arg<5>(ImageSize{0, 3})),
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
                     zt::bad(StatusBadAnchor, zt::arg<5>(ImageSize{3, 1}), zt::arg<7>(&badNoise)));
    for (float bad : {-0.0001f, 1.0f, std::numeric_limits<float>::quiet_NaN()}) {
        float n = bad;
        EXPECT_EQ(z.zoriFilterWiener_8u_C1R(src, 20, d, 12, roi, m, {1, 1}, &n, buf), StatusBadArgument);
    }
    int size = 0;
    zt::expectChecks(z.zoriFilterWienerGetBufferSize, {roi, m, 1, &size}, {}, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<0>(ImageSize{0, 1})),
                     zt::bad(StatusBadMaskSize, zt::arg<1>(ImageSize{1, -1})),
                     zt::bad(StatusBadChannelCount, zt::arg<2>(0)),
                     zt::bad(StatusBadSize, zt::arg<0>(ImageSize{1 << 30, 1}), zt::arg<2>(4)));
    zt::expectChecks(z.zoriConvFull_32f_C1R, {f, 8, {2, 2}, g, 4, {1, 3}, f + 16, 8}, {zt::watch(f + 16, 48)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<5>(ImageSize{1, 0})),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0x7FFFFFFF, 1}), zt::arg<5>(ImageSize{2, 3})), zt::bad(StatusBadStep, zt::arg<7>(0)),
                     zt::bad(StatusBadStep, zt::arg<4>(0)));
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
                const auto d = c.outImage<uint8_t>(r.width * ch, r.height);
                const uint8_t* p = s.p + a.y * s.step + a.x * ch;
                const int mask = m.width * 11;  // 55, 33, then unknown codes
                Status st = (ch == 1 ? z.zoriFilterBox_8u_C1R : z.zoriFilterBox_8u_C3R)(p, s.step, d.p, d.step, r, m, a);
                st += (ch == 1 ? z.zoriFilterGauss_8u_C1R : z.zoriFilterGauss_8u_C3R)(p, s.step, d.p, d.step, r, mask);
                if (ch == 3) return st;
                st += z.zoriFilterLowpass_8u_C1R(p, s.step, d.p, d.step, r, mask) +
                      z.zoriFilterHipass_8u_C1R(p, s.step, d.p, d.step, r, mask);
                float* noise = c.out<float>(1);
                *noise = c.index() % 2 ? 0.0f : 0.002f;
                int size = 0;
                zt::api(0).zoriFilterWienerGetBufferSize(r, m, 1, &size);
                uint8_t* buf = c.in<uint8_t>(size_t(size));  // scratch: not compared
                const auto dw = c.outImage<uint8_t>(r.width, r.height);
                return st + z.zoriFilterWiener_8u_C1R(p, s.step, dw.p, dw.step, r, m, a, noise, buf);
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
