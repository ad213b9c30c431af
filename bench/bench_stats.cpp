// Image statistics on 1920 x 1080 images against OpenCV (single-threaded).
//
// The C3CR extrema have no OpenCV counterpart on interleaved images:
// cv::minMaxLoc takes one channel, so its peer is what an OpenCV user
// writes for the same answer, cv::extractChannel followed by cv::minMaxLoc
// (minMaxLoc alone, on a channel extracted beforehand, is shown too).
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cmath>
#include <cstdint>
#include <vector>

#include "bench/pairs.h"
#include "bench/picture.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
constexpr ImageSize kRoi{kW, kH};

// The test picture in 8u, a blurred copy, a three-channel 16u variant of it
// and a float copy.
struct Scene {
    cv::Mat gray = zb::testPicture(kW, kH), gray2, rgb16, real;
    Scene() {
        cv::GaussianBlur(gray, gray2, cv::Size(5, 5), 1.5);
        gray.convertTo(real, CV_32F, 1.0 / 16);
        rgb16.create(kH, kW, CV_16UC3);
        uint32_t r = 777;
        for (int y = 0; y < kH; ++y)
            for (int x = 0; x < kW; ++x)
                for (int c = 0; c < 3; ++c) {
                    r = r * 1664525u + 1013904223u;
                    rgb16.at<cv::Vec3w>(y, x)[c] = uint16_t(gray.at<uint8_t>(y, x) * (200 + 25 * c) + (r >> 24));
                }
    }
};

const Scene& scene() {
    static const Scene s;
    return s;
}

// ---- sum ---------------------------------------------------------------------

void zorSum(benchmark::State& st) {
    const cv::Mat& g = scene().gray;
    double sum = 0;
    for (auto _ : st) {
        zoriSum_8u_C1R(g.data, int(g.step), kRoi, &sum);
        benchmark::DoNotOptimize(sum);
    }
}
void cvSum(benchmark::State& st) {
    const cv::Mat& g = scene().gray;
    for (auto _ : st) benchmark::DoNotOptimize(cv::sum(g));
}
ZB_PAIR(sum_8u, "zoriSum_8u_C1R 1920x1080", zorSum, cvSum, "cv::sum", 1.0);

void zorNormDiff(benchmark::State& st) {
    const Scene& s = scene();
    double n = 0;
    for (auto _ : st) {
        zoriNormDiff_L1_8u_C1R(s.gray.data, int(s.gray.step), s.gray2.data, int(s.gray2.step), kRoi, &n);
        benchmark::DoNotOptimize(n);
    }
}
void cvNormDiff(benchmark::State& st) {
    const Scene& s = scene();
    for (auto _ : st) benchmark::DoNotOptimize(cv::norm(s.gray, s.gray2, cv::NORM_L1));
}
ZB_PAIR(norm_l1_8u, "zoriNormDiff_L1_8u_C1R 1920x1080", zorNormDiff, cvNormDiff, "cv::norm L1", 0);

void zorSumFloat(benchmark::State& st) {
    const cv::Mat& f = scene().real;
    double sum = 0;
    for (auto _ : st) {
        zoriSum_32f_C1R(f.ptr<float>(), int(f.step), kRoi, &sum, 0);
        benchmark::DoNotOptimize(sum);
    }
}
void cvSumFloat(benchmark::State& st) {
    const cv::Mat& f = scene().real;
    for (auto _ : st) benchmark::DoNotOptimize(cv::sum(f));
}
ZB_PAIR(sum_32f, "zoriSum_32f_C1R (fast) 1920x1080", zorSumFloat, cvSumFloat, "cv::sum", 0);

// ---- mean and deviation, extrema ----------------------------------------------

void zorMinMaxIndx(benchmark::State& st) {
    const cv::Mat& m = scene().rgb16;
    float lo, hi;
    ImagePoint pl, ph;
    for (auto _ : st) {
        zoriMinMaxIndx_16u_C3CR(m.ptr<uint16_t>(), int(m.step), kRoi, 2, &lo, &hi, &pl, &ph);
        benchmark::DoNotOptimize(lo);
    }
}
void cvMinMaxIndx(benchmark::State& st) {
    const cv::Mat& m = scene().rgb16;
    cv::Mat channel;
    double lo, hi;
    cv::Point pl, ph;
    for (auto _ : st) {
        cv::extractChannel(m, channel, 1);
        cv::minMaxLoc(channel, &lo, &hi, &pl, &ph);
        benchmark::DoNotOptimize(lo);
    }
}
ZB_PAIR(minmaxindx_16u, "zoriMinMaxIndx_16u_C3CR 1920x1080", zorMinMaxIndx, cvMinMaxIndx,
        "cv::extractChannel + cv::minMaxLoc", 1.0);

// For reference: the peer without the extraction, on a channel extracted beforehand.
void cvMinMaxLocOnly(benchmark::State& st) {
    cv::Mat channel;
    cv::extractChannel(scene().rgb16, channel, 1);
    double lo, hi;
    cv::Point pl, ph;
    for (auto _ : st) {
        cv::minMaxLoc(channel, &lo, &hi, &pl, &ph);
        benchmark::DoNotOptimize(lo);
    }
}
ZB_PAIR(minmaxindx_16u_loc, "zoriMinMaxIndx_16u_C3CR (peer: minMaxLoc only)", zorMinMaxIndx, cvMinMaxLocOnly,
        "cv::minMaxLoc on a channel extracted beforehand", 0);

void zorMeanStdDev(benchmark::State& st) {
    const cv::Mat& m = scene().rgb16;
    double mean, dev;
    for (auto _ : st) {
        zoriMean_StdDev_16u_C3CR(m.ptr<uint16_t>(), int(m.step), kRoi, 2, &mean, &dev);
        benchmark::DoNotOptimize(dev);
    }
}
void cvMeanStdDev(benchmark::State& st) {
    const cv::Mat& m = scene().rgb16;
    cv::Mat channel;
    cv::Scalar mean, dev;
    for (auto _ : st) {
        cv::extractChannel(m, channel, 1);
        cv::meanStdDev(channel, mean, dev);
        benchmark::DoNotOptimize(dev);
    }
}
ZB_PAIR(meanstddev_16u, "zoriMean_StdDev_16u_C3CR 1920x1080", zorMeanStdDev, cvMeanStdDev,
        "cv::extractChannel + cv::meanStdDev", 0);

// ---- histogram ------------------------------------------------------------------

// bins equal bins over 0 .. 256
template <int Bins>
void zorHistogram(benchmark::State& st) {
    const cv::Mat& g = scene().gray;
    std::vector<int32_t> levels(Bins + 1), hist(Bins);
    for (int k = 0; k <= Bins; ++k) levels[k] = k * 256 / Bins;
    for (auto _ : st) {
        zoriHistogramRange_8u_C1R(g.data, int(g.step), kRoi, hist.data(), levels.data(), Bins + 1);
        benchmark::DoNotOptimize(hist.data());
    }
}
template <int Bins>
void cvHistogram(benchmark::State& st) {
    const cv::Mat& g = scene().gray;
    const int channels[] = {0}, bins[] = {Bins};
    const float range[] = {0, 256};
    const float* ranges[] = {range};
    cv::Mat hist;
    for (auto _ : st) {
        cv::calcHist(&g, 1, channels, cv::Mat(), hist, 1, bins, ranges);
        benchmark::DoNotOptimize(hist.data);
    }
}
ZB_PAIR(histogram_8u, "zoriHistogramRange_8u_C1R 256 bins 1920x1080", zorHistogram<256>, cvHistogram<256>,
        "cv::calcHist", 1.0);
ZB_PAIR(histogram_8u_4, "zoriHistogramRange_8u_C1R 4 bins 1920x1080", zorHistogram<4>, cvHistogram<4>,
        "cv::calcHist", 0);

// ---- moments --------------------------------------------------------------------

void zorMoments(benchmark::State& st) {
    const cv::Mat& f = scene().real;
    MomentState* state = nullptr;
    zoriMomentInitAlloc_64f(&state, 0);
    for (auto _ : st) {
        zoriMoments64f_32f_C1R(f.ptr<float>(), int(f.step), kRoi, state);
        benchmark::DoNotOptimize(state->moments[0][0]);
    }
    zoriMomentFree_64f(state);
}
void cvMoments(benchmark::State& st) {
    const cv::Mat& f = scene().real;
    for (auto _ : st) benchmark::DoNotOptimize(cv::moments(f));
}
ZB_PAIR(moments_32f, "zoriMoments64f_32f_C1R 1920x1080", zorMoments, cvMoments, "cv::moments", 1.0);

}  // namespace
