// Flood fill at 1920 x 1080 against cv::floodFill, and the 3 x 3 QR solve
// against cv::solve, single thread.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cstdint>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
constexpr ImageSize kRoi{kW, kH};

// A large background region (0) around scattered discs and bars (255).
struct Scene {
    cv::Mat binary, smooth;
    Scene() : binary(kH, kW, CV_8UC1, cv::Scalar(0)), smooth(kH, kW, CV_8UC1) {
        uint32_t r = 2024;
        auto next = [&](int n) { return int((r = r * 1664525u + 1013904223u) >> 8) % n; };
        for (int i = 0; i < 400; ++i)
            cv::circle(binary, {next(kW), next(kH)}, 3 + next(40), cv::Scalar(255), cv::FILLED);
        for (int i = 0; i < 60; ++i)
            cv::rectangle(binary, cv::Rect(next(kW), next(kH), 2 + next(200), 2 + next(6)), cv::Scalar(255), cv::FILLED);
        binary.at<uint8_t>(0, 0) = 0;
        for (int y = 0; y < kH; ++y)  // gentle slopes with steps between them
            for (int x = 0; x < kW; ++x) smooth.at<uint8_t>(y, x) = uint8_t((x / 7 + y / 5) % 200 + ((x / 240 + y / 180) % 3) * 20);
    }
};
Scene& scene() {
    static Scene s;
    return s;
}

// Every call fills the same region: 0 -> 1, then 1 -> 0.
void zorFill4(benchmark::State& st) {
    cv::Mat& img = scene().binary;
    int size = 0;
    zoriFloodFillGetSize(kRoi, &size);
    std::vector<uint8_t> buffer(size);
    ConnectedComp region;
    uint8_t value = 1;
    for (auto _ : st) {
        zoriFloodFill_4Con_8u_C1IR(img.data, int(img.step), kRoi, {0, 0}, value, &region, buffer.data());
        value ^= 1;
    }
}
void cvFill4(benchmark::State& st) {
    cv::Mat& img = scene().binary;
    int value = 1;
    for (auto _ : st) {
        cv::floodFill(img, cv::Point(0, 0), cv::Scalar(value), nullptr, cv::Scalar(), cv::Scalar(),
                      4 | cv::FLOODFILL_FIXED_RANGE);
        value ^= 1;
    }
}

// Gradient fills change the picture: both sides fill a fresh copy.
void zorFillGrad4(benchmark::State& st) {
    cv::Mat work;
    int size = 0;
    zoriFloodFillGetSize_Grad(kRoi, &size);
    std::vector<uint8_t> buffer(size);
    ConnectedComp region;
    for (auto _ : st) {
        scene().smooth.copyTo(work);
        zoriFloodFill_Grad4Con_8u_C1IR(work.data, int(work.step), kRoi, {kW / 2, kH / 2}, 255, 1, 1, &region,
                                       buffer.data());
    }
}
void cvFillGrad4(benchmark::State& st) {
    cv::Mat work;
    for (auto _ : st) {
        scene().smooth.copyTo(work);
        cv::floodFill(work, cv::Point(kW / 2, kH / 2), cv::Scalar(255), nullptr, cv::Scalar(1), cv::Scalar(1), 4);
    }
}

const double kA[9] = {4, -2, 1, 3, 6, -4, 2, 1, 8}, kB[3] = {12, -25, 32};

void zorSolve3(benchmark::State& st) {
    double qr[9], buffer[3], x[3];
    for (auto _ : st) {
        zormQRDecomp_m_64f(kA, 24, 8, buffer, qr, 24, 8, 3, 3);
        zormQRBackSubst_mv_64f(qr, 24, 8, buffer, kB, 8, x, 8, 3, 3);
        benchmark::DoNotOptimize(x);
    }
}
void cvSolve3(benchmark::State& st) {
    const cv::Mat a(3, 3, CV_64F, const_cast<double*>(kA)), b(3, 1, CV_64F, const_cast<double*>(kB));
    cv::Mat x(3, 1, CV_64F);
    for (auto _ : st) {
        cv::solve(a, b, x, cv::DECOMP_QR);
        benchmark::DoNotOptimize(x.data);
    }
}

}  // namespace

ZB_PAIR(flood4, "zoriFloodFill_4Con_8u_C1IR large region 1920x1080", zorFill4, cvFill4,
        "cv::floodFill 4-connected, fixed range 0", 1.0);
ZB_PAIR(floodgrad4, "zoriFloodFill_Grad4Con_8u_C1IR 1920x1080", zorFillGrad4, cvFillGrad4,
        "cv::floodFill 4-connected, floating range 1", 0);
ZB_PAIR(qr3, "zormQRDecomp_m_64f + BackSubst 3x3", zorSolve3, cvSolve3, "cv::solve DECOMP_QR", 0.5);
