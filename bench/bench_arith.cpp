// Pixel arithmetic at 1920 x 1080, single thread: saturating addition and
// comparison with a constant against OpenCV, alpha composition (Over)
// against a plain per-pixel loop computing the same exact result.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include <cstdint>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
const ImageSize kRoi = {kW, kH};

cv::Mat randomMat(int type) {
    cv::Mat m(kH, kW, type);
    cv::randu(m, cv::Scalar::all(0), cv::Scalar::all(256));
    return m;
}

struct Images {
    cv::Mat a = randomMat(CV_8UC1), b = randomMat(CV_8UC1), out = randomMat(CV_8UC1);
    cv::Mat rgba1 = randomMat(CV_8UC4), rgba2 = randomMat(CV_8UC4), rgbaOut = randomMat(CV_8UC4);
};
Images& img() {
    static Images i;
    return i;
}

void zorAdd(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriAdd_8u_C1RSfs(m.a.data, int(m.a.step), m.b.data, int(m.b.step), m.out.data,
                                                   int(m.out.step), kRoi, 0));
}
void cvAdd(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::add(m.a, m.b, m.out);
        benchmark::ClobberMemory();
    }
}

void zorCompareC(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(
            zoriCompareC_8u_C1R(m.a.data, int(m.a.step), 128, m.out.data, int(m.out.step), kRoi, CmpGreater));
}
void cvCompareC(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::compare(m.a, 128, m.out, cv::CMP_GT);
        benchmark::ClobberMemory();
    }
}

void zorOver(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriAlphaComp_8u_AC4R(m.rgba1.data, int(m.rgba1.step), m.rgba2.data,
                                                       int(m.rgba2.step), m.rgbaOut.data, int(m.rgbaOut.step), kRoi,
                                                       AlphaOver));
}
// A over B as a user would write it: per pixel, colour = (cA a 255 + cB b
// (255 - a) + 32512) / 65025, the alpha byte as a colour of 255.
__attribute__((optimize("O2"), noinline)) void overLoop(const uint8_t* s1, const uint8_t* s2, uint8_t* d,
                                                         int pixels) {
    for (int i = 0; i < pixels; ++i, s1 += 4, s2 += 4, d += 4) {
        const unsigned a = s1[3], weightA = a * 255, weightB = s2[3] * (255 - a);
        for (int k = 0; k < 3; ++k) d[k] = uint8_t((s1[k] * weightA + s2[k] * weightB + 32512) / 65025);
        d[3] = uint8_t((255 * (weightA + weightB) + 32512) / 65025);
    }
}
void loopOver(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        overLoop(m.rgba1.data, m.rgba2.data, m.rgbaOut.data, kW * kH);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(add_8u, "zoriAdd_8u_C1RSfs sf 0 1920x1080", zorAdd, cvAdd, "cv::add", 1.0);
ZB_PAIR(comparec_8u, "zoriCompareC_8u_C1R > 1920x1080", zorCompareC, cvCompareC, "cv::compare", 1.0);
ZB_PAIR(alpha_over, "zoriAlphaComp_8u_AC4R Over 1920x1080", zorOver, loopOver, "plain per-pixel loop -O2", 0.5);
