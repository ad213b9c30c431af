// Pixel movers at 1920 x 1080, single thread: copies, planar layouts, type
// conversions, channel order and fills against memcpy and OpenCV.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cstring>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
const ImageSize kRoi = {kW, kH};

cv::Mat randomMat(int type) {
    cv::Mat m(kH, kW, type);
    cv::randu(m, cv::Scalar::all(0), cv::Scalar::all(255));
    return m;
}

struct Images {
    cv::Mat c3 = randomMat(CV_8UC3), c3out = cv::Mat(kH, kW, CV_8UC3);
    cv::Mat c1 = randomMat(CV_8UC1), c1out = cv::Mat(kH, kW, CV_8UC1);
    cv::Mat f1 = randomMat(CV_32FC1), f1out = cv::Mat(kH, kW, CV_32FC1);
    // filled, not just allocated: untouched pages all map to one zero page,
    // which would make the merge read one physical page three times over
    std::vector<cv::Mat> planes = {randomMat(CV_8UC1), randomMat(CV_8UC1), randomMat(CV_8UC1)};
};
Images& img() {
    static Images i;
    return i;
}

void zorCopyC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriCopy_8u_C3R(m.c3.data, int(m.c3.step), m.c3out.data, int(m.c3out.step), kRoi));
}
void memcpyC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        std::memcpy(m.c3out.data, m.c3.data, size_t(kW) * kH * 3);
        benchmark::ClobberMemory();
    }
}

void zorSplit(benchmark::State& st) {
    Images& m = img();
    uint8_t* p[3] = {m.planes[0].data, m.planes[1].data, m.planes[2].data};
    for (auto _ : st) benchmark::DoNotOptimize(zoriCopy_8u_C3P3R(m.c3.data, int(m.c3.step), p, kW, kRoi));
}
void cvSplit(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::split(m.c3, m.planes);
        benchmark::ClobberMemory();
    }
}

void zorMerge(benchmark::State& st) {
    Images& m = img();
    const uint8_t* p[3] = {m.planes[0].data, m.planes[1].data, m.planes[2].data};
    for (auto _ : st) benchmark::DoNotOptimize(zoriCopy_8u_P3C3R(p, kW, m.c3out.data, int(m.c3out.step), kRoi));
}
void cvMerge(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::merge(m.planes, m.c3out);
        benchmark::ClobberMemory();
    }
}

void zorTo32f(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriConvert_8u32f_C1R(m.c1.data, int(m.c1.step), reinterpret_cast<float*>(m.f1out.data),
                                                       int(m.f1out.step), kRoi));
}
void cvTo32f(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        m.c1.convertTo(m.f1out, CV_32F);
        benchmark::ClobberMemory();
    }
}

void zorTo8u(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriConvert_32f8u_C1R(reinterpret_cast<const float*>(m.f1.data), int(m.f1.step),
                                                       m.c1out.data, int(m.c1out.step), kRoi, 1));
}
void cvTo8u(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        m.f1.convertTo(m.c1out, CV_8U);
        benchmark::ClobberMemory();
    }
}

void zorSwap(benchmark::State& st) {
    Images& m = img();
    const int order[3] = {2, 1, 0};
    for (auto _ : st)
        benchmark::DoNotOptimize(
            zoriSwapChannels_8u_C3R(m.c3.data, int(m.c3.step), m.c3out.data, int(m.c3out.step), kRoi, order));
}
void cvSwap(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::cvtColor(m.c3, m.c3out, cv::COLOR_RGB2BGR);
        benchmark::ClobberMemory();
    }
}

void zorSetC3(benchmark::State& st) {
    Images& m = img();
    const uint8_t v[3] = {10, 20, 30};
    for (auto _ : st) benchmark::DoNotOptimize(zoriSet_8u_C3R(v, m.c3out.data, int(m.c3out.step), kRoi));
}
void cvSetC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        m.c3out.setTo(cv::Scalar(10, 20, 30));
        benchmark::ClobberMemory();
    }
}

// The fill and the widening at 3840 x 2160, outputs larger than the
// last-level caches that the movers assume (non-temporal stores).
constexpr int kBigW = 3840, kBigH = 2160;
struct BigImages {
    cv::Mat c1 = cv::Mat(kBigH, kBigW, CV_8UC1, cv::Scalar(7));
    cv::Mat c3out = cv::Mat(kBigH, kBigW, CV_8UC3, cv::Scalar(0, 0, 0));
    cv::Mat f1out = cv::Mat(kBigH, kBigW, CV_32FC1, cv::Scalar(0));
};
BigImages& big() {
    static BigImages b;
    return b;
}
void zorSetC3Big(benchmark::State& st) {
    BigImages& m = big();
    const uint8_t v[3] = {10, 20, 30};
    for (auto _ : st) benchmark::DoNotOptimize(zoriSet_8u_C3R(v, m.c3out.data, int(m.c3out.step), {kBigW, kBigH}));
}
void cvSetC3Big(benchmark::State& st) {
    BigImages& m = big();
    for (auto _ : st) {
        m.c3out.setTo(cv::Scalar(10, 20, 30));
        benchmark::ClobberMemory();
    }
}
void zorTo32fBig(benchmark::State& st) {
    BigImages& m = big();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriConvert_8u32f_C1R(m.c1.data, int(m.c1.step), reinterpret_cast<float*>(m.f1out.data),
                                                       int(m.f1out.step), {kBigW, kBigH}));
}
void cvTo32fBig(benchmark::State& st) {
    BigImages& m = big();
    for (auto _ : st) {
        m.c1.convertTo(m.f1out, CV_32F);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(copy_c3, "zoriCopy_8u_C3R 1920x1080", zorCopyC3, memcpyC3, "memcpy", 1.10);
ZB_PAIR(split_c3, "zoriCopy_8u_C3P3R 1920x1080", zorSplit, cvSplit, "cv::split", 0.8);
ZB_PAIR(merge_c3, "zoriCopy_8u_P3C3R 1920x1080", zorMerge, cvMerge, "cv::merge", 0.8);
ZB_PAIR(cvt_8u32f, "zoriConvert_8u32f_C1R 1920x1080", zorTo32f, cvTo32f, "Mat::convertTo(CV_32F)", 1.0);
ZB_PAIR(cvt_32f8u, "zoriConvert_32f8u_C1R mode 1 1920x1080", zorTo8u, cvTo8u, "Mat::convertTo(CV_8U)", 1.0);
ZB_PAIR(swap_c3, "zoriSwapChannels_8u_C3R {2,1,0} 1920x1080", zorSwap, cvSwap, "cv::cvtColor(RGB2BGR)", 1.0);
ZB_PAIR(set_c3, "zoriSet_8u_C3R 1920x1080", zorSetC3, cvSetC3, "Mat::setTo", 1.0);
ZB_PAIR(set_c3_big, "zoriSet_8u_C3R 3840x2160", zorSetC3Big, cvSetC3Big, "Mat::setTo", 0);
ZB_PAIR(cvt_8u32f_big, "zoriConvert_8u32f_C1R 3840x2160", zorTo32fBig, cvTo32fBig, "Mat::convertTo(CV_32F)", 0);
