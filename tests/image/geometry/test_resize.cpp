// Resize on every variant: every mode against the definition computed in
// double, the shifted and centred mappings, the fractions, the checks, the
// 8u read guard and the alternate super-sampling (white-box and through a
// copy of the built library loaded beside a marker file).
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include "frame/attach.h"
#include "frame/memory.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

#if defined(_WIN32)
#  include <windows.h>
#else
#  include <dlfcn.h>
#  include <unistd.h>
#endif

namespace {

class Resize : public zt::VariantTest {};

// ---- the definition, in double -------------------------------------------------

// One direction: where destination pixel i samples, and the width of its
// super-sampling footprint (centred on the sample's pixel area).
struct Axis {
    std::function<double(int)> at;
    double width;  // source pixels per destination pixel
};
Axis plain(int roiStart, double f) { return {[=](int i) { return roiStart + (i + 0.5) / f - 0.5; }, 1 / f}; }

double lanczos(double d) {
    const double a = 3.141592653589793 * std::fabs(d);
    return a == 0 ? 1 : std::fabs(d) >= 3 ? 0 : std::sin(a) * std::sin(a / 3) / (a * a / 3);
}
double catmullRom(double d) {  // a = -0.5
    d = std::fabs(d);
    return d <= 1 ? 1.5 * d * d * d - 2.5 * d * d + 1 : d < 2 ? -0.5 * d * d * d + 2.5 * d * d - 4 * d + 2 : 0;
}

// (pixel, weight) pairs of destination pixel i on an axis of n pixels.
std::vector<std::pair<int, double>> taps(const Axis& a, int i, int mode, int n) {
    const auto clamp = [n](double j) { return j < 0 ? 0 : j > n - 1 ? n - 1 : int(j); };
    const double s = a.at(i), x0 = std::floor(s), t = s - x0;
    std::vector<std::pair<int, double>> r;
    if (mode == InterNearest) return {{clamp(std::floor(s + 0.5)), 1.0}};
    if (mode == InterSuper && a.width >= 1) {  // area: integrate pixel by pixel
        const double lo = s + 0.5 - a.width / 2, hi = s + 0.5 + a.width / 2;
        for (double j = std::floor(lo); j < hi; ++j)
            r.push_back({clamp(j), (std::fmin(hi, j + 1) - std::fmax(lo, j)) / a.width});
        return r;
    }
    double sum = 0;
    const int k0 = mode == InterLanczos ? -2 : mode == InterCubic ? -1 : 0, k1 = -k0 + 1;
    for (int k = k0; k <= k1; ++k) {
        const double w = mode == InterLanczos ? lanczos(t - k) : mode == InterCubic ? catmullRom(t - k) : 1 - std::fabs(t - k);
        r.push_back({clamp(x0 + k), w});
        sum += w;
    }
    if (mode == InterLanczos)
        for (auto& p : r) p.second /= sum;
    return r;
}

// Exact value of element (i, j, c) and the sum of the magnitudes of its terms.
template <class Get>
std::pair<double, double> exact(const Axis& ax, const Axis& ay, int mode, ImageSize src, int i, int j, Get get) {
    double v = 0, mag = 0;
    for (auto [y, wy] : taps(ay, j, mode, src.height))
        for (auto [x, wx] : taps(ax, i, mode, src.width)) {
            v += wy * wx * get(x, y);
            mag += std::fabs(wy * wx * get(x, y));
        }
    return {v, mag};
}

template <class T>
void fillRandom(zt::GuardedImage<T>& img, std::mt19937& rng) {
    img.fill([&](int, int) {
        return std::is_same_v<T, float> ? double(int(rng() % 200001) - 100000) / 100 : double(rng() % (std::is_same_v<T, uint8_t> ? 256 : 65536));
    });
}

// 8u, 16u: within 1 of the exact value (clamped), nearest exactly; 32f:
// within 1e-5 of the magnitudes.  Untouched (false `written`) pixels keep
// the destination's fill.
template <class T>
void expectDefinition(const zt::GuardedImage<T>& d, int channels, const Axis& ax, const Axis& ay, int mode,
                      ImageSize src, const std::function<double(int, int)>& get,
                      const std::function<bool(int, int)>& written = nullptr) {
    const double top = std::is_same_v<T, uint8_t> ? 255 : 65535;
    for (int j = 0; j < d.height(); ++j)
        for (int e = 0; e < d.width(); ++e) {
            const int i = e / channels, c = e % channels;
            const double got = *d.at(e, j);
            if (written && !written(i, j)) {
                ASSERT_EQ(got, zt::GuardedImage<uint8_t>::kFill);  // (8u only)
                continue;
            }
            auto [v, mag] = exact(ax, ay, mode, src, i, j, [&](int x, int y) { return get(x * channels + c, y); });
            const std::string at = "mode " + std::to_string(mode) + " at " + std::to_string(e) + "," + std::to_string(j);
            if (std::is_same_v<T, float>) ASSERT_NEAR(got, v, 1e-5 * mag + 1e-30) << at;
            else if (mode == InterNearest) ASSERT_EQ(got, v) << at;
            else ASSERT_NEAR(got, std::fmin(std::fmax(v, 0), top), 1.0) << at;
        }
}

template <class T>
using ResizeFn = Status(ZOR_CALL*)(const T*, ImageSize, int, ImageRect, T*, int, ImageSize, double, double, int);

template <class T>
void checkPlain(ResizeFn<T> fn, int channels, ImageSize src, ImageRect roi, ImageSize dst, double fx, double fy,
                uint32_t seed) {
    std::mt19937 rng(seed);
    // the source is the image alone, against a protected page on one side
    zt::GuardedImage<T> s(src.width * channels, src.height, 0, 0, seed % 2 ? zt::Guard::After : zt::Guard::Before);
    fillRandom(s, rng);
    for (int mode : {InterNearest, InterLinear, InterCubic, InterSuper, InterLanczos}) {
        zt::GuardedImage<T> d(dst.width * channels, dst.height, 0, 3 * sizeof(T));
        ASSERT_EQ(fn(s.roi(), src, s.step(), roi, d.roi(), d.step(), dst, fx, fy, mode), StatusOk);
        ASSERT_TRUE(d.outsideIntact());
        expectDefinition(d, channels, plain(roi.x, fx), plain(roi.y, fy), mode, src,
                         [&](int x, int y) { return double(*s.at(x, y)); });
    }
}

// Factor pairs: shrinking and growing, mixed, exact halves (the 2 x 2
// path), and 0.11 (super-sampling footprints wider than 8 taps).
const double kFactors[][2] = {{0.5, 0.5}, {0.66, 1.5}, {2.3, 0.8}, {1, 1}, {0.11, 0.3}, {0.37, 0.5}};

TEST_P(Resize, EveryModeAgainstTheDefinition) {
    uint32_t seed = 1;
    for (auto [fx, fy] : kFactors) {
        const ImageSize src{37, 23};
        const ImageRect roi{3, 2, 30, 20};
        const ImageSize dst{std::max(1, int(30 * fx) + 1), std::max(1, int(20 * fy) + 1)};  // reaching past the image
        checkPlain<uint8_t>(z().zoriResize_8u_C1R, 1, src, roi, dst, fx, fy, ++seed);
        checkPlain<uint8_t>(z().zoriResize_8u_C3R, 3, src, roi, dst, fx, fy, ++seed);
        checkPlain<uint8_t>(z().zoriResize_8u_C4R, 4, src, roi, dst, fx, fy, ++seed);
        checkPlain<uint16_t>(z().zoriResize_16u_C1R, 1, src, roi, dst, fx, fy, ++seed);
        checkPlain<uint16_t>(z().zoriResize_16u_C3R, 3, src, roi, dst, fx, fy, ++seed);
        checkPlain<uint16_t>(z().zoriResize_16u_C4R, 4, src, roi, dst, fx, fy, ++seed);
        checkPlain<float>(z().zoriResize_32f_C1R, 1, src, roi, dst, fx, fy, ++seed);
        checkPlain<float>(z().zoriResize_32f_C3R, 3, src, roi, dst, fx, fy, ++seed);
        checkPlain<float>(z().zoriResize_32f_C4R, 4, src, roi, dst, fx, fy, ++seed);
    }
}

// Values near the edges of the fixed-point range: steps between 0 and 255
// overshoot with cubic and Lanczos, and saturate.
TEST_P(Resize, ExtremesSaturateWithinOne) {
    std::mt19937 rng(5);
    const ImageSize src{64, 9};
    zt::GuardedImage<uint8_t> s(64 * 3, 9);
    s.fill([&](int x, int y) { return ((x / 3 + y) / 2 % 2) * 255 ^ (rng() % 7 == 0 ? 255 : 0); });
    for (double f : {0.77, 1.9, 3.0})
        for (int mode : {InterCubic, InterLanczos, InterLinear}) {
            const ImageSize dst{int(64 * f), int(9 * f)};
            zt::GuardedImage<uint8_t> d(dst.width * 3, dst.height);
            ASSERT_EQ(z().zoriResize_8u_C3R(s.roi(), src, s.step(), {0, 0, 64, 9}, d.roi(), d.step(), dst, f, f, mode), 0);
            expectDefinition(d, 3, plain(0, f), plain(0, f), mode, src, [&](int x, int y) { return double(*s.at(x, y)); });
        }
}

TEST_P(Resize, HalvesAverageTwoByTwo) {
    uint8_t src[2][6] = {{0, 1, 255, 255, 10, 11}, {1, 1, 255, 254, 12, 13}};
    uint8_t dst[3];
    ASSERT_EQ(z().zoriResize_8u_C1R(&src[0][0], {6, 2}, 6, {0, 0, 6, 2}, dst, 3, {3, 1}, 0.5, 0.5, InterSuper), 0);
    EXPECT_EQ(dst[0], 1);    // 3 / 4 rounds up
    EXPECT_EQ(dst[1], 255);  // 1019 / 4 = 254.75
    EXPECT_EQ(dst[2], 12);   // 46 / 4 = 11.5, half up
}

TEST_P(Resize, ShiftedAndCentredMappings) {
    std::mt19937 rng(9);
    const ImageSize src{29, 17};
    const ImageRect roi{4, 3, 20, 11};
    zt::GuardedImage<uint8_t> s(src.width * 3, src.height);
    fillRandom(s, rng);
    const auto get = [&](int x, int y) { return double(*s.at(x, y)); };
    double xFr = 0, yFr = 0;
    for (int mode : {InterNearest, InterLinear, InterCubic, InterSuper, InterLanczos}) {
        // fractions that make the corners meet, then shifts of a pixel and a half
        ASSERT_EQ(zt::api(0).zoriGetResizeFract(src, roi, 1.6, 8.0 / 11, &xFr, &yFr, InterLinear), StatusOk);
        for (double shift : {0.0, 1.5}) {
            const ImageSize dst{32, 8};
            zt::GuardedImage<uint8_t> d(dst.width * 3, dst.height);
            ASSERT_EQ(z().zoriResizeShift_8u_C3R(s.roi(), src, s.step(), roi, d.roi(), d.step(), dst, xFr, yFr, shift,
                                                 -shift, mode), StatusOk);
            const Axis ax{[&](int i) { return roi.x + (i - shift) * xFr; }, xFr};
            const Axis ay{[&](int i) { return roi.y + (i + shift) * yFr; }, yFr};
            expectDefinition(d, 3, ax, ay, mode, src, get);
            if (shift == 0 && mode != InterSuper)  // corners meet
                for (int c = 0; c < 3; ++c) {
                    EXPECT_EQ(*d.at(c, 0), *s.at(roi.x * 3 + c, roi.y));
                    EXPECT_EQ(*d.at(31 * 3 + c, 7), *s.at((roi.x + roi.width - 1) * 3 + c, roi.y + roi.height - 1));
                }
        }
        // about (10.3, 7): that point stays, pixels sampling outside the ROI stay untouched
        for (auto [fx, fy] : {std::pair{2.5, 0.6}, std::pair{0.4, 1.7}}) {
            const ImageSize dst{40, 21};
            zt::GuardedImage<uint8_t> d1(dst.width, dst.height), d3(dst.width * 3, dst.height);
            const Axis ax{[&](int i) { return 10.3 + (i - 10.3) * (1 / fx); }, 1 / fx};
            const Axis ay{[&](int i) { return 7 + (i - 7.0) * (1 / fy); }, 1 / fy};
            const auto inside = [&](int i, int j) {
                return ax.at(i) >= roi.x - 0.5 && ax.at(i) < roi.x + roi.width - 0.5 && ay.at(j) >= roi.y - 0.5 &&
                       ay.at(j) < roi.y + roi.height - 0.5;
            };
            ASSERT_EQ(z().zoriResizeCenter_8u_C3R(s.roi(), src, s.step(), roi, d3.roi(), d3.step(), dst, fx, fy, 10.3, 7,
                                                  mode), StatusOk);
            expectDefinition(d3, 3, ax, ay, mode, src, get, inside);
            ASSERT_EQ(z().zoriResizeCenter_8u_C1R(s.roi(), src, s.step(), roi, d1.roi(), d1.step(), dst, fx, fy, 10.3, 7,
                                                  mode), StatusOk);
            expectDefinition(d1, 1, ax, ay, mode, src, get, inside);  // the first third of each row as one channel
            if (mode == InterNearest) {
                EXPECT_EQ(*d3.at(10 * 3 + 1, 7), *s.at(10 * 3 + 1, 7));
            }
        }
    }
}

TEST(ResizeFract, ValuesAndCheckOrder) {
    const auto fract = zt::api(0).zoriGetResizeFract;
    double x = -1, y = -1;
    EXPECT_EQ(fract({40, 30}, {0, 0, 10, 1}, 2, 0.5, &x, &y, InterLinear), StatusOk);
    EXPECT_EQ(x, 9.0 / 19);
    EXPECT_EQ(y, 0);  // one row
    EXPECT_EQ(fract({40, 30}, {38, 0, 10, 3}, 0.5, 2, &x, &y, InterCubic), StatusOk);
    EXPECT_EQ(x, 0);  // clipped to 2 wide: 0.5 * 2 is not above 1
    EXPECT_EQ(y, 2.0 / 5);
    EXPECT_EQ(fract({40, 30}, {0, 0, 10, 3}, 4, 0.5, &x, &y, InterNearest), StatusOk);
    EXPECT_EQ(x, 0.25);
    EXPECT_EQ(y, 2);
    x = y = -1;
    EXPECT_EQ(fract({40, 30}, {0, 0, 10, 3}, 2, NAN, &x, &y, InterLinear), StatusOk);  // NaN passes
    EXPECT_EQ(fract({40, 30}, {40, 0, 1, 1}, 2, 2, nullptr, nullptr, InterLinear), StatusWarnNoOperation);
    EXPECT_EQ(fract({40, 30}, {0, 0, 1, 1}, 0, 2, nullptr, &y, InterLinear), StatusBadResizeFactor);
    EXPECT_EQ(fract({40, 30}, {-1, 0, 1, 1}, 0, 2, nullptr, &y, InterLinear), StatusBadSize);
    EXPECT_EQ(fract({40, 30}, {0, 0, 1, 1}, 1, 1, &x, nullptr, 7), StatusNullPointer);
    x = -1;
    EXPECT_EQ(fract({40, 30}, {0, 0, 1, 1}, 1, 1, &x, &y, InterSuper), StatusBadInterpolation);
    EXPECT_EQ(x, -1);
}

TEST_P(Resize, Checks) {
    std::vector<float> src(12 * 10, 1.0f), dst(6 * 5, 0.0f);
    const ImageRect roi{0, 0, 12, 10};
    zt::expectChecks(z().zoriResize_32f_C1R, {src.data(), {12, 10}, 48, roi, dst.data(), 24, {6, 5}, 0.5, 0.5, 2},
                     {zt::watch(dst)}, zt::eachNull(),
                     zt::bad(StatusBadSize, zt::arg<1>(ImageSize{0, 10})),
                     zt::bad(StatusBadSize, zt::arg<3>(ImageRect{0, 0, 12, 0})),
                     zt::bad(StatusBadSize, zt::arg<6>(ImageSize{6, -1})),
                     zt::bad(StatusBadStep, zt::arg<2>(0)), zt::bad(StatusBadStep, zt::arg<5>(-24)),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{12, 0, 1, 1})),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{0, -1, 1, 1})),
                     zt::bad(StatusBadResizeFactor, zt::arg<7>(0.0)),
                     zt::bad(StatusBadResizeFactor, zt::arg<8>(NAN)),
                     zt::bad(StatusBadInterpolation, zt::arg<9>(3)),
                     zt::bad(StatusBadStep, zt::arg<5>(0), zt::arg<7>(-1.0), zt::arg<9>(0)),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{0, 10, 1, 1}), zt::arg<7>(-1.0)),
                     zt::bad(StatusBadResizeFactor, zt::arg<7>(-1.0), zt::arg<9>(0)));
    std::vector<uint8_t> s8(12 * 10 * 3), d8(6 * 5 * 3);
    zt::expectChecks(z().zoriResizeShift_8u_C3R, {s8.data(), {12, 10}, 36, roi, d8.data(), 18, {6, 5}, 0.0, 2.0, 0, 0, 8},
                     {zt::watch(d8)}, zt::eachNull(), zt::bad(StatusBadResizeFactor, zt::arg<8>(-0.5)),
                     zt::bad(StatusBadInterpolation, zt::arg<11>(1 + 2)));
    zt::expectChecks(z().zoriResizeCenter_8u_C1R, {s8.data(), {12, 10}, 12, roi, d8.data(), 6, {6, 5}, 0.5, 0.5, 3.0, 3.0, 16},
                     {zt::watch(d8)}, zt::eachNull(), zt::bad(StatusNullPointer, zt::arg<4>(nullptr), zt::arg<1>(ImageSize{})),
                     zt::bad(StatusBadInterpolation, zt::arg<11>(32)));
}

TEST_P(Resize, VariantsAgree) {
    for (int mode : {InterNearest, InterLinear, InterCubic, InterSuper, InterLanczos})
        zt::agreesWithGeneric(variant(), [mode](const zt::Api& z, zt::Case& c) {
            const ImageSize s = c.roi();
            const double fx = kFactors[c.index() % 6][0], fy = kFactors[(c.index() + 1) % 6][1];
            const ImageSize d{std::max(1, int(s.width * fx + 1)), std::max(1, int(s.height * fy))};
            const ImageRect roi{s.width / 3, 0, s.width, s.height};
            const auto s8 = c.inImage<uint8_t>(s.width * 3, s.height);
            const auto d8 = c.outImage<uint8_t>(d.width * 3, d.height);
            const auto s1 = c.inImage<uint8_t>(s.width, s.height);
            const auto d1 = c.outImage<uint8_t>(d.width, d.height);
            const auto s16 = c.inImage<uint16_t>(s.width * 4, s.height);
            const auto d16 = c.outImage<uint16_t>(d.width * 4, d.height);
            const auto sf = c.inImage<float>(s.width * 3, s.height);
            const auto df = c.outImage<float>(d.width * 3, d.height);
            return z.zoriResize_8u_C3R(s8.p, s, s8.step, roi, d8.p, d8.step, d, fx, fy, mode) * 1000000 +
                   z.zoriResize_8u_C1R(s1.p, s, s1.step, roi, d1.p, d1.step, d, fx, fy, mode) * 10000 +
                   z.zoriResize_16u_C4R(s16.p, s, s16.step, roi, d16.p, d16.step, d, fx, fy, mode) * 100 +
                   z.zoriResize_32f_C3R(sf.p, s, sf.step, roi, df.p, df.step, d, fx, fy, mode);
        });
}

// ---- the read guard -----------------------------------------------------------------------

std::vector<size_t> requests;
void* recordingAlloc(size_t n) {
    requests.push_back(n);
    return std::malloc(n);
}

TEST_P(Resize, GuardCopiesWhenTheRowPastTheImageIsUnreadable) {
    std::mt19937 rng(17);
    const ImageSize src{24, 9};
    const int step = 24 * 3;
    for (bool readableAfter : {false, true})
        for (ImageRect roi : {ImageRect{0, 0, 24, 9}, ImageRect{0, 2, 24, 6}}) {
            zt::GuardedBuffer buf(size_t(step) * (src.height + (readableAfter ? 1 : 0)));  // ends at a protected page
            for (size_t k = 0; k < buf.size(); ++k) buf.data()[k] = uint8_t(rng());
            // the reference image: the last row repeated below it
            std::vector<uint8_t> padded(buf.data(), buf.data() + step * src.height);
            padded.insert(padded.end(), buf.data() + step * (src.height - 1), buf.data() + step * src.height);
            std::vector<uint8_t> got(12 * 3 * 5), want(got.size());
            requests.clear();
            zor::mem::rawAlloc = recordingAlloc;
            const Status st = z().zoriResize_8u_C3R(buf.data(), src, step, roi, got.data(), 36, {12, 5}, 0.5, 0.7, InterSuper);
            zor::mem::rawAlloc = std::malloc;
            ASSERT_EQ(st, StatusOk);
            const size_t copy = size_t(step) * (src.height + 1) + zor::mem::kOverhead;
            const bool copied = std::find(requests.begin(), requests.end(), copy) != requests.end();
            EXPECT_EQ(copied, !readableAfter && roi.height % 2 == 1);
            ASSERT_EQ(zt::api(0).zoriResize_8u_C3R(padded.data(), src, step, roi, want.data(), 36, {12, 5}, 0.5, 0.7,
                                                   InterSuper), StatusOk);
            EXPECT_EQ(got, want);
        }
}

// ---- the alternate super-sampling -------------------------------------------------------------

struct AlternateOn {
    AlternateOn() { zor::frame::altSuperSampling = 1; }
    ~AlternateOn() { zor::frame::altSuperSampling = 0; }
};

// Rows 0..4 by columns 0..5, three channels: value 10 x + y + 40 c.
std::vector<uint8_t> spanImage() {
    std::vector<uint8_t> v(6 * 3 * 5);
    for (int y = 0; y < 5; ++y)
        for (int x = 0; x < 6; ++x)
            for (int c = 0; c < 3; ++c) v[(y * 6 + x) * 3 + c] = uint8_t(10 * x + y + 40 * c);
    return v;
}

TEST_P(Resize, AlternateSuperSamplingBySpans) {
    AlternateOn on;
    const std::vector<uint8_t> img = spanImage();
    std::vector<uint8_t> out(2 * 2 * 3, 0xEE);
    const auto resize = z().zoriResize_8u_C3R;
    const Status st = resize(img.data(), {6, 5}, 18, {0, 0, 6, 4}, out.data(), 6, {2, 2}, 0.4, 0.5, InterSuper);
    if (variant() < 2) {  // the library's super-sampling
        EXPECT_EQ(resize(nullptr, {6, 5}, 18, {0, 0, 6, 4}, out.data(), 6, {2, 2}, 0.4, 0.5, InterSuper), StatusNullPointer);
        return;
    }
    ASSERT_EQ(st, StatusOk);
    // K = trunc(65536 * 0.2) = 13107; columns [0, 2.5) and [2.5, 5): 256, 256, 128
    // and 128, 256, 256; rows [0, 2) and [2, 4).
    for (int j = 0; j < 2; ++j)
        for (int i = 0; i < 2; ++i)
            for (int c = 0; c < 3; ++c) {
                uint32_t sum = 0;
                for (int y = 2 * j; y < 2 * j + 2; ++y) {
                    const auto p = [&](int x) { return uint32_t(img[(y * 6 + x) * 3 + c]); };
                    sum += i == 0 ? 256 * (p(0) + p(1)) + 128 * p(2) : 128 * p(2) + 256 * (p(3) + p(4));
                }
                EXPECT_EQ(out[(j * 2 + i) * 3 + c], uint8_t((sum * 13107u + (1u << 23)) >> 24)) << i << j << c;
            }
    // Halves: the pixel sum plus 2, over 4; no check at all, factors above 1 taken.
    ASSERT_EQ(resize(img.data(), {6, 5}, 18, {0, 0, 6, 4}, out.data(), 6, {2, 2}, 0.5, 0.5, InterSuper), StatusOk);
    EXPECT_EQ(out[3 + 2], (100 + 101 + 110 + 111 + 2) / 4);
    EXPECT_EQ(resize(nullptr, {6, 5}, 18, {0, 0, 6, 4}, out.data(), 6, {2, 2}, 0.5, 0.5, InterSuper), StatusOk);
    EXPECT_EQ(resize(img.data(), {6, 5}, -3, {0, 0, 6, 4}, out.data(), 6, {0, 2}, 3.0, -1.0, InterSuper), StatusOk);
    EXPECT_EQ(resize(img.data(), {6, 5}, 18, {0, 0, 6, 4}, out.data(), 6, {2, 2}, 0.5, 0.5, InterLinear), StatusOk);
}

// The marker file beside a copy of the built library switches the path on
// at load; the copy without it keeps the library's super-sampling.
TEST(ResizeMarker, CopyOfTheLibraryBesideAMarkerFile) {
#if defined(_WIN32)
    char exe[MAX_PATH];
    GetModuleFileNameA(nullptr, exe, MAX_PATH);
    std::string dir(exe);
    dir = dir.substr(0, dir.find_last_of("\\/") + 1);
    const std::string built = dir + "zor.dll", tmp = std::getenv("TEMP") ? std::getenv("TEMP") : ".";
    const std::string base = tmp + "\\zor_marker_" + std::to_string(GetCurrentProcessId());
    const std::string lib = base + ".dll";
#else
    const std::string built = ZT_LIBRARY_FILE;
    const std::string base = "/tmp/zor_marker_" + std::to_string(getpid());
    const std::string lib = base + ".so";
#endif
    for (bool marker : {true, false}) {
        {
            std::ifstream in(built, std::ios::binary);
            ASSERT_TRUE(in.good()) << built;
            std::ofstream(lib, std::ios::binary) << in.rdbuf();
        }
        if (marker) std::ofstream(base + ".xml") << "";
#if defined(_WIN32)
        HMODULE h = LoadLibraryA(lib.c_str());
        ASSERT_NE(h, nullptr);
        auto resize = reinterpret_cast<decltype(zt::Api::zoriResize_8u_C3R)>(GetProcAddress(h, "zoriResize_8u_C3R"));
#else
        void* h = dlopen(lib.c_str(), RTLD_NOW | RTLD_LOCAL);
        ASSERT_NE(h, nullptr) << dlerror();
        auto resize = reinterpret_cast<decltype(zt::Api::zoriResize_8u_C3R)>(dlsym(h, "zoriResize_8u_C3R"));
#endif
        ASSERT_NE(resize, nullptr);
        uint8_t out[12];
        const Status st = resize(nullptr, {6, 5}, 18, {0, 0, 6, 4}, out, 6, {2, 2}, 0.5, 0.5, InterSuper);
        EXPECT_EQ(st, marker && zt::variantSupported(2) ? StatusOk : StatusNullPointer);
#if defined(_WIN32)
        FreeLibrary(h);
#else
        dlclose(h);
#endif
        std::remove(lib.c_str());
        std::remove((base + ".xml").c_str());
    }
}

}  // namespace

ZT_ALL_VARIANTS(Resize);
