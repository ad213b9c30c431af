// Resize on every variant: every mode against the definition computed in
// double, the shifted and centred mappings, the fractions, the checks, the
// 8u read guard and the alternate super-sampling (white-box and through a
// copy of the built library loaded beside a marker file).
#include <algorithm>
#include <cmath>
#include <cstdio>
#include <fstream>
#include <functional>
#include <random>
#include <string>
#include <vector>

#include "frame/attach.h"
#include "frame/fpu.h"
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
#ifdef ZT_HAVE_OPENCV
#  include <opencv2/imgproc.hpp>
#endif

namespace {

class Resize : public zt::VariantTest {};
const int kModes[] = {InterNearest, InterLinear, InterCubic, InterSuper, InterLanczos};

// ---- the definition, in double -------------------------------------------------

// One direction: where destination pixel i samples, and the source pixels
// per destination pixel (the width of the super-sampling footprint, centred
// on the sample's pixel area).
struct Axis { std::function<double(int)> at; double width; };
Axis plain(int roiStart, double f) { return {[=](int i) { return roiStart + (i + 0.5) / f - 0.5; }, 1 / f}; }

double kernel(int mode, double d) {
    const double a = 3.141592653589793 * std::fabs(d);
    d = std::fabs(d);
    if (mode == InterLanczos) return a == 0 ? 1 : d >= 3 ? 0 : std::sin(a) * std::sin(a / 3) / (a * a / 3);
    if (mode == InterCubic)  // Catmull-Rom
        return d <= 1 ? 1.5 * d * d * d - 2.5 * d * d + 1 : d < 2 ? -0.5 * d * d * d + 2.5 * d * d - 4 * d + 2 : 0;
    return 1 - d;
}

// (pixel, weight) pairs of destination pixel i on an axis of n pixels.
std::vector<std::pair<int, double>> taps(const Axis& a, int i, int mode, int n) {
    const auto clamp = [n](double j) { return j < 0 ? 0 : j > n - 1 ? n - 1 : int(j); };
    const double s = a.at(i), x0 = std::floor(s);
    std::vector<std::pair<int, double>> r;
    if (mode == InterNearest) return {{clamp(std::floor(s + 0.5)), 1.0}};
    if (mode == InterSuper && a.width >= 1) {  // area, pixel by pixel
        const double lo = s + 0.5 - a.width / 2, hi = s + 0.5 + a.width / 2;
        for (double j = std::floor(lo); j < hi; ++j)
            r.push_back({clamp(j), (std::fmin(hi, j + 1) - std::fmax(lo, j)) / a.width});
        return r;
    }
    const int k0 = mode == InterLanczos ? -2 : mode == InterCubic ? -1 : 0;
    double sum = 0;
    for (int k = k0; k <= 1 - k0; ++k) sum += r.emplace_back(clamp(x0 + k), kernel(mode, s - x0 - k)).second;
    for (auto& p : r) p.second /= sum;  // (Lanczos; the others sum to 1)
    return r;
}

// 8u, 16u: within 1 of the exact value (clamped), nearest exactly; 32f:
// within 1e-5 of the sum of the terms' magnitudes.  Pixels not `written`
// keep the fill (8u).
template <class T>
void expectDefinition(const zt::GuardedImage<T>& d, int channels, const Axis& ax, const Axis& ay, int mode,
                      ImageSize src, const std::function<double(int, int)>& get,
                      const std::function<bool(int, int)>& written = nullptr) {
    zor::DoublePrecisionScope precision;  // x87: round as double (nearest ties)
    for (int j = 0; j < d.height(); ++j)
        for (int e = 0; e < d.width(); ++e) {
            const int i = e / channels;
            const double got = *d.at(e, j);
            if (written && !written(i, j)) {
                ASSERT_EQ(got, zt::GuardedImage<uint8_t>::kFill);
                continue;
            }
            double v = 0, mag = 0;
            for (auto [y, wy] : taps(ay, j, mode, src.height))
                for (auto [x, wx] : taps(ax, i, mode, src.width)) {
                    v += wy * wx * get(x * channels + e % channels, y);
                    mag += std::fabs(wy * wx * get(x * channels + e % channels, y));
                }
            const std::string at = "mode " + std::to_string(mode) + " at " + std::to_string(e) + "," + std::to_string(j);
            if (std::is_same_v<T, float>) ASSERT_NEAR(got, v, 1e-5 * mag + 1e-30) << at;
            else if (mode == InterNearest) ASSERT_EQ(got, v) << at;
            else ASSERT_NEAR(got, std::clamp(v, 0.0, std::is_same_v<T, uint8_t> ? 255.0 : 65535.0), 1.0) << at;
        }
}

// Random values; every other 8u picture in blocks of 0 and 255, where
// cubic and Lanczos overshoot and saturate.
template <class T>
void fillRandom(zt::GuardedImage<T>& img, std::mt19937& rng) {
    const bool blocks = std::is_same_v<T, uint8_t> && rng() % 2;
    img.fill([&](int x, int y) {
        if (blocks) return ((x / 5 + y / 2) % 2) * 255.0;
        return std::is_same_v<T, float> ? (int(rng() % 200001) - 100000) / 100.0 : rng() % (sizeof(T) == 1 ? 256 : 65536);
    });
}

template <class T>
using ResizeFn = Status(ZOR_CALL*)(const T*, ImageSize, int, ImageRect, T*, int, ImageSize, double, double, int);

// Shrinking, growing, mixed, exact halves; area footprints of 10 taps
// (float passes) and of 77 (double, beyond the image).
const double kFactors[][2] = {{0.5, 0.5}, {0.66, 1.5}, {2.3, 0.8}, {1, 1}, {0.11, 0.3}, {0.37, 0.5}, {3, 1.9}, {0.013, 0.9}};

template <class T>
void checkPlain(ResizeFn<T> fn, int channels, uint32_t seed) {
    std::mt19937 rng(seed);
    const ImageSize src{37, 23};
    const ImageRect roi{3, 2, 30, 20};
    // the source is the image alone, against a protected page on one side
    zt::GuardedImage<T> s(src.width * channels, src.height, 0, 0, seed % 2 ? zt::Guard::After : zt::Guard::Before);
    for (const auto& [fx, fy] : kFactors) {
        fillRandom(s, rng);
        const ImageSize dst{int(30 * fx) + 1, int(20 * fy) + 1};  // reaching past the image
        for (int mode : kModes) {
            zt::GuardedImage<T> d(dst.width * channels, dst.height, 0, 3 * sizeof(T));
            ASSERT_EQ(fn(s.roi(), src, s.step(), roi, d.roi(), d.step(), dst, fx, fy, mode), StatusOk);
            ASSERT_TRUE(d.outsideIntact());
            expectDefinition(d, channels, plain(roi.x, fx), plain(roi.y, fy), mode, src,
                             [&](int x, int y) { return double(*s.at(x, y)); });
        }
    }
}

TEST_P(Resize, EveryModeAgainstTheDefinition) {
    checkPlain<uint8_t>(z().zoriResize_8u_C1R, 1, 1);
    checkPlain<uint8_t>(z().zoriResize_8u_C3R, 3, 2);
    checkPlain<uint8_t>(z().zoriResize_8u_C4R, 4, 3);
    checkPlain<uint16_t>(z().zoriResize_16u_C1R, 1, 4);
    checkPlain<uint16_t>(z().zoriResize_16u_C3R, 3, 5);
    checkPlain<uint16_t>(z().zoriResize_16u_C4R, 4, 6);
    checkPlain<float>(z().zoriResize_32f_C1R, 1, 7);
    checkPlain<float>(z().zoriResize_32f_C3R, 3, 8);
    checkPlain<float>(z().zoriResize_32f_C4R, 4, 9);
}

// Halves: the 2 x 2 path (C1) and the fixed-point passes (C3) round alike.
TEST_P(Resize, HalvesAverageTwoByTwo) {
    uint8_t src[2][6] = {{0, 1, 255, 255, 10, 11}, {1, 1, 255, 254, 12, 13}}, dst[3];
    ASSERT_EQ(z().zoriResize_8u_C1R(&src[0][0], {6, 2}, 6, {0, 0, 6, 2}, dst, 3, {3, 1}, 0.5, 0.5, InterSuper), 0);
    EXPECT_EQ(std::vector<int>(dst, dst + 3), (std::vector<int>{1, 255, 12}));  // 3/4, 1019/4, 46/4 half up
    ASSERT_EQ(z().zoriResize_8u_C3R(&src[0][0], {2, 2}, 6, {0, 0, 2, 2}, dst, 3, {1, 1}, 0.5, 0.5, InterSuper), 0);
    EXPECT_EQ(std::vector<int>(dst, dst + 3), (std::vector<int>{128, 6, 134}));  // 510/4, 24/4, 534/4
}

#ifdef ZT_HAVE_OPENCV
// Linear and shrinking super-sampling stay within 1 of OpenCV's linear and
// area resizes.
TEST_P(Resize, WithinOneOfOpenCv) {
    cv::Mat c3(57, 83, CV_8UC3), c1;
    cv::randu(c3, 0, 256);
    cv::extractChannel(c3, c1, 1);
    for (const cv::Mat& s : {c1, c3})
        for (cv::Size d : {cv::Size(55, 38), cv::Size(41, 19), cv::Size(20, 9), cv::Size(121, 90)})
            for (int mode : {InterLinear, InterSuper}) {
                if (mode == InterSuper && d.width > s.cols) continue;
                cv::Mat want, got(d, s.type()), diff;
                cv::resize(s, want, d, 0, 0, mode == InterLinear ? cv::INTER_LINEAR : cv::INTER_AREA);
                const auto fn = s.channels() == 1 ? z().zoriResize_8u_C1R : z().zoriResize_8u_C3R;
                ASSERT_EQ(fn(s.data, {s.cols, s.rows}, int(s.step), {0, 0, s.cols, s.rows}, got.data, int(got.step),
                             {d.width, d.height}, double(d.width) / s.cols, double(d.height) / s.rows, mode), 0);
                cv::absdiff(got, want, diff);
                EXPECT_LE(cv::norm(diff, cv::NORM_INF), 1) << d << " mode " << mode << " channels " << s.channels();
            }
}
#endif

TEST_P(Resize, ShiftedAndCentredMappings) {
    std::mt19937 rng(9);
    const ImageSize src{29, 17};
    const ImageRect roi{4, 3, 20, 11};
    zt::GuardedImage<uint8_t> s(src.width * 3, src.height);
    fillRandom(s, rng);
    const auto get = [&](int x, int y) { return double(*s.at(x, y)); };
    double xFr = 0, yFr = 0;  // corners meet, then shifted by a pixel and a half
    ASSERT_EQ(zt::api(0).zoriGetResizeFract(src, roi, 1.6, 8.0 / 11, &xFr, &yFr, InterLinear), StatusOk);
    for (int mode : kModes) {
        for (double shift : {0.0, 1.5}) {
            zt::GuardedImage<uint8_t> d(32 * 3, 8);
            ASSERT_EQ(z().zoriResizeShift_8u_C3R(s.roi(), src, s.step(), roi, d.roi(), d.step(), {32, 8}, xFr, yFr,
                                                 shift, -shift, mode), StatusOk);
            expectDefinition(d, 3, {[&](int i) { return roi.x + (i - shift) * xFr; }, xFr},
                             {[&](int i) { return roi.y + (i + shift) * yFr; }, yFr}, mode, src, get);
            for (int c = 0; c < 3 && shift == 0 && mode != InterSuper; ++c) {
                EXPECT_EQ(*d.at(c, 0), *s.at(roi.x * 3 + c, roi.y));
                EXPECT_EQ(*d.at(31 * 3 + c, 7), *s.at((roi.x + roi.width - 1) * 3 + c, roi.y + roi.height - 1));
            }
        }
        // about (10.3, 7): pixels sampling outside the ROI stay untouched
        for (auto [fx, fy] : {std::pair{2.5, 0.6}, std::pair{0.4, 1.7}}) {
            const Axis ax{[&](int i) { return 10.3 + (i - 10.3) * (1 / fx); }, 1 / fx};
            const Axis ay{[&](int i) { return 7 + (i - 7.0) * (1 / fy); }, 1 / fy};
            const auto inside = [&](int i, int j) {
                return ax.at(i) >= roi.x - 0.5 && ax.at(i) < roi.x + roi.width - 0.5 && ay.at(j) >= roi.y - 0.5 &&
                       ay.at(j) < roi.y + roi.height - 0.5;
            };
            for (int ch : {1, 3}) {  // one channel: a third of each row
                zt::GuardedImage<uint8_t> d(40 * ch, 21);
                const auto fn = ch == 1 ? z().zoriResizeCenter_8u_C1R : z().zoriResizeCenter_8u_C3R;
                ASSERT_EQ(fn(s.roi(), src, s.step(), roi, d.roi(), d.step(), {40, 21}, fx, fy, 10.3, 7, mode), 0);
                expectDefinition(d, ch, ax, ay, mode, src, get, inside);
            }
        }
    }
}

TEST(ResizeFract, ValuesAndCheckOrder) {
    double x = -1, y = -1;
    const auto fract = [&](ImageRect roi, double fx, double fy, int mode, bool outputs = true) {
        return zt::api(0).zoriGetResizeFract({40, 30}, roi, fx, fy, outputs ? &x : nullptr, &y, mode);
    };
    const auto both = [&](ImageRect roi, double fx, double fy, int mode) {
        return fract(roi, fx, fy, mode) == StatusOk ? std::pair(x, y) : std::pair(-1.0, -1.0);
    };
    EXPECT_EQ(both({0, 0, 10, 1}, 2, 0.5, InterLinear), std::pair(9.0 / 19, 0.0));  // one row: 0
    EXPECT_EQ(both({38, 0, 10, 3}, 0.5, 2, InterCubic), std::pair(0.0, 2.0 / 5));  // clipped to 2: 0.5 * 2 not above 1
    EXPECT_EQ(both({0, 0, 10, 3}, 4, 0.5, InterNearest), std::pair(0.25, 2.0));
    EXPECT_EQ(fract({0, 0, 10, 3}, 2, NAN, InterLinear), StatusOk);  // NaN passes
    EXPECT_EQ(fract({40, 0, 1, 1}, 2, 2, InterLinear, false), StatusWarnNoOperation);
    EXPECT_EQ(fract({0, 0, 1, 1}, 0, 2, InterLinear, false), StatusBadResizeFactor);
    EXPECT_EQ(fract({-1, 0, 1, 1}, 0, 2, InterLinear, false), StatusBadSize);
    EXPECT_EQ(fract({0, 0, 1, 1}, 1, 1, 7, false), StatusNullPointer);
    x = -1;
    EXPECT_EQ(fract({0, 0, 1, 1}, 1, 1, InterSuper), StatusBadInterpolation);
    EXPECT_EQ(x, -1);
}

TEST_P(Resize, Checks) {
    std::vector<float> src(12 * 10, 1.0f), dst(6 * 5, 0.0f);
    const ImageRect roi{0, 0, 12, 10};
    zt::expectChecks(z().zoriResize_32f_C1R, {src.data(), {12, 10}, 48, roi, dst.data(), 24, {6, 5}, 0.5, 0.5, 2},
                     {zt::watch(dst)}, zt::eachNull(), zt::bad(StatusBadSize, zt::arg<1>(ImageSize{0, 10})),
                     zt::bad(StatusBadSize, zt::arg<3>(ImageRect{0, 0, 12, 0})),
                     zt::bad(StatusBadSize, zt::arg<6>(ImageSize{6, -1})), zt::bad(StatusBadStep, zt::arg<2>(0)),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{12, 0, 1, 1})),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{0, -1, 1, 1})),
                     zt::bad(StatusBadResizeFactor, zt::arg<7>(0.0)), zt::bad(StatusBadResizeFactor, zt::arg<8>(NAN)),
                     zt::bad(StatusBadInterpolation, zt::arg<9>(3)),
                     zt::bad(StatusBadStep, zt::arg<5>(-24), zt::arg<7>(-1.0), zt::arg<9>(0)),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(ImageRect{0, 10, 1, 1}), zt::arg<7>(-1.0)),
                     zt::bad(StatusBadResizeFactor, zt::arg<7>(-1.0), zt::arg<9>(0)));
    std::vector<uint8_t> s8(12 * 10 * 3), d8(6 * 5 * 3);
    // a fraction of 0 is accepted
    zt::expectChecks(z().zoriResizeShift_8u_C3R, {s8.data(), {12, 10}, 36, roi, d8.data(), 18, {6, 5}, 0.0, 2.0, 0, 0, 8},
                     {zt::watch(d8)}, zt::eachNull(), zt::bad(StatusBadResizeFactor, zt::arg<8>(-0.5)));
    zt::expectChecks(z().zoriResizeCenter_8u_C1R, {s8.data(), {12, 10}, 12, roi, d8.data(), 6, {6, 5}, 0.5, 0.5, 3.0, 3.0, 16},
                     {zt::watch(d8)}, zt::eachNull(), zt::bad(StatusBadInterpolation, zt::arg<11>(32)));
}

TEST_P(Resize, VariantsAgree) {
    for (int mode : kModes)
        zt::agreesWithGeneric(variant(), [mode](const zt::Api& z, zt::Case& c) {
            const ImageSize s = c.roi();
            const double fx = kFactors[c.index() % 8][0], fy = kFactors[(c.index() + 1) % 8][1];
            const ImageSize d{int(s.width * fx + 1), std::max(1, int(s.height * fy))};
            const ImageRect roi{s.width / 3, 0, s.width, s.height};
            const auto s8 = c.inImage<uint8_t>(s.width * 3, s.height), d8 = c.outImage<uint8_t>(d.width * 3, d.height);
            const auto s1 = c.inImage<uint8_t>(s.width, s.height), d1 = c.outImage<uint8_t>(d.width, d.height);
            const auto s16 = c.inImage<uint16_t>(s.width * 4, s.height), d16 = c.outImage<uint16_t>(d.width * 4, d.height);
            const auto sf = c.inImage<float>(s.width * 3, s.height), df = c.outImage<float>(d.width * 3, d.height);
            return z.zoriResize_8u_C3R(s8.p, s, s8.step, roi, d8.p, d8.step, d, fx, fy, mode) * 1000000 +
                   z.zoriResize_8u_C1R(s1.p, s, s1.step, roi, d1.p, d1.step, d, fx, fy, mode) * 10000 +
                   z.zoriResize_16u_C4R(s16.p, s, s16.step, roi, d16.p, d16.step, d, fx, fy, mode) * 100 +
                   z.zoriResize_32f_C3R(sf.p, s, sf.step, roi, df.p, df.step, d, fx, fy, mode);
        });
}

// ---- the 8u read guard and the alternate super-sampling ---------------------------------

std::vector<size_t> requests;
void* recordingAlloc(size_t n) {
    requests.push_back(n);
    return std::malloc(n);
}

// An image ending at a protected page (odd ROI height) is resized from a
// copy with its last row repeated; otherwise no copy is made.
TEST_P(Resize, GuardCopiesWhenTheRowPastTheImageIsUnreadable) {
    std::mt19937 rng(17);
    const ImageSize src{24, 9};
    const int step = 24 * 3;
    for (bool readableAfter : {false, true})
        for (ImageRect roi : {ImageRect{0, 0, 24, 9}, ImageRect{0, 2, 24, 6}}) {
            zt::GuardedBuffer buf(size_t(step) * (src.height + readableAfter));
            for (size_t k = 0; k < buf.size(); ++k) buf.data()[k] = uint8_t(rng());
            std::vector<uint8_t> padded(buf.data(), buf.data() + step * src.height), got(12 * 3 * 5), want(got);
            padded.insert(padded.end(), buf.data() + step * (src.height - 1), buf.data() + step * src.height);
            requests.clear();
            zor::mem::rawAlloc = recordingAlloc;
            const Status st = z().zoriResize_8u_C3R(buf.data(), src, step, roi, got.data(), 36, {12, 5}, 0.5, 0.7, 8);
            zor::mem::rawAlloc = std::malloc;
            ASSERT_EQ(st, StatusOk);
            const size_t copy = size_t(step) * (src.height + 1) + zor::mem::kOverhead;
            EXPECT_EQ(std::count(requests.begin(), requests.end(), copy), !readableAfter && roi.height % 2 == 1);
            ASSERT_EQ(zt::api(0).zoriResize_8u_C3R(padded.data(), src, step, roi, want.data(), 36, {12, 5}, 0.5, 0.7, 8), 0);
            EXPECT_EQ(got, want);
        }
}

TEST_P(Resize, AlternateSuperSamplingBySpans) {
    struct On {
        On() { zor::frame::altSuperSampling = 1; }
        ~On() { zor::frame::altSuperSampling = 0; }
    } on;
    std::vector<uint8_t> img(6 * 3 * 5), out(2 * 2 * 3);  // value 10 x + y + 40 c
    for (size_t k = 0; k < img.size(); ++k) img[k] = uint8_t(10 * (k / 3 % 6) + k / 18 + 40 * (k % 3));
    const auto resize = [&](const uint8_t* p, int step, ImageSize d, double fx, double fy, int mode = InterSuper) {
        return z().zoriResize_8u_C3R(p, {6, 5}, step, {0, 0, 6, 4}, out.data(), 6, d, fx, fy, mode);
    };
    if (variant() < 2) {  // the library's super-sampling
        EXPECT_EQ(resize(nullptr, 18, {2, 2}, 0.5, 0.5), StatusNullPointer);
        return;
    }
    // K = trunc(65536 * 0.2) = 13107; columns [0, 2.5) and [2.5, 5) weigh
    // 256, 256, 128 and 128, 256, 256; rows [0, 2) and [2, 4) are whole.
    ASSERT_EQ(resize(img.data(), 18, {2, 2}, 0.4, 0.5), StatusOk);
    for (int k = 0; k < 12; ++k) {
        const int i = k / 3 % 2, j = k / 6, c = k % 3;
        const auto p = [&](int x, int y) { return uint32_t(img[(y * 6 + x) * 3 + c]); };
        uint32_t sum = 0;
        for (int y = 2 * j; y < 2 * j + 2; ++y)
            sum += i == 0 ? 256 * (p(0, y) + p(1, y)) + 128 * p(2, y) : 128 * p(2, y) + 256 * (p(3, y) + p(4, y));
        EXPECT_EQ(out[k], uint8_t((sum * 13107u + (1u << 23)) >> 24)) << k;
    }
    // Halves: the pixel sum plus 2, over 4.  No argument is checked.
    ASSERT_EQ(resize(img.data(), 18, {2, 2}, 0.5, 0.5), StatusOk);
    EXPECT_EQ(out[3 + 2], (100 + 101 + 110 + 111 + 2) / 4);
    EXPECT_EQ(resize(nullptr, 18, {2, 2}, 0.5, 0.5), StatusOk);
    EXPECT_EQ(resize(img.data(), -3, {0, 2}, 3.0, -1.0), StatusOk);
}

// A copy of the built library beside a marker file takes the alternate
// path from its load on; a copy without one does not.
TEST(ResizeMarker, CopyOfTheLibraryBesideAMarkerFile) {
#if defined(_WIN32)
    char exe[MAX_PATH];
    const std::string path(exe, GetModuleFileNameA(nullptr, exe, MAX_PATH)), tmp = std::getenv("TEMP");
    const std::string built = path.substr(0, path.find_last_of("\\/") + 1) + "zor.dll";
    const std::string base = tmp + "\\zor_marker_" + std::to_string(GetCurrentProcessId()), lib = base + ".dll";
    const auto open = [](const std::string& f) { return (void*)LoadLibraryA(f.c_str()); };
    const auto find = [](void* h) { return (void*)GetProcAddress(HMODULE(h), "zoriResize_8u_C3R"); };
    const auto close = [](void* h) { FreeLibrary(HMODULE(h)); };
#else
    const std::string built = ZT_LIBRARY_FILE, base = "/tmp/zor_marker_" + std::to_string(getpid()), lib = base + ".so";
    const auto open = [](const std::string& f) { return dlopen(f.c_str(), RTLD_NOW | RTLD_LOCAL); };
    const auto find = [](void* h) { return dlsym(h, "zoriResize_8u_C3R"); };
    const auto close = [](void* h) { dlclose(h); };
#endif
    for (bool marker : {true, false}) {
        std::ofstream(lib, std::ios::binary) << std::ifstream(built, std::ios::binary).rdbuf();
        if (marker) std::ofstream(base + ".xml") << "";
        void* h = open(lib);
        ASSERT_NE(h, nullptr) << built;
        const auto resize = reinterpret_cast<decltype(zt::Api::zoriResize_8u_C3R)>(find(h));
        ASSERT_NE(resize, nullptr);
        uint8_t out[12];
        EXPECT_EQ(resize(nullptr, {6, 5}, 18, {0, 0, 6, 4}, out, 6, {2, 2}, 0.5, 0.5, InterSuper),
                  marker && zt::variantSupported(2) ? StatusOk : StatusNullPointer);
        close(h);
        std::remove(lib.c_str()), std::remove((base + ".xml").c_str());
    }
}

}  // namespace

ZT_ALL_VARIANTS(Resize);
