// Mirrors at 1920 x 1080, single thread, against cv::flip.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
const ImageSize kRoi = {kW, kH};

struct Images {
    cv::Mat c3 = cv::Mat(kH, kW, CV_8UC3, cv::Scalar(1, 2, 3)), c3out = cv::Mat(kH, kW, CV_8UC3);
    cv::Mat c1 = cv::Mat(kH, kW, CV_8UC1, cv::Scalar(7)), c1out = cv::Mat(kH, kW, CV_8UC1);
};
Images& img() {
    static Images i;
    return i;
}

void zorMirrorC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(
            zoriMirror_8u_C3R(m.c3.data, int(m.c3.step), m.c3out.data, int(m.c3out.step), kRoi, 1));
}
void cvFlipC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::flip(m.c3, m.c3out, 1);
        benchmark::ClobberMemory();
    }
}

void zorMirrorC1InPlace(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) benchmark::DoNotOptimize(zoriMirror_8u_C1IR(m.c1.data, int(m.c1.step), kRoi, 2));
}
void cvFlipC1(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::flip(m.c1, m.c1out, -1);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(mirror_c3, "zoriMirror_8u_C3R axis 1 1920x1080", zorMirrorC3, cvFlipC3, "cv::flip(1)", 0.6);
ZB_PAIR(mirror_c1ir, "zoriMirror_8u_C1IR axis 2 1920x1080", zorMirrorC1InPlace, cvFlipC1,
        "cv::flip(-1), not in place", 1.0);
