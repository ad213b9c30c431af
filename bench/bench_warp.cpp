// Affine warps and rotations of 8-bit images, bilinear, single thread,
// against cv::warpAffine with the same source-to-destination matrix and a
// transparent border (pixels whose source point falls outside the image
// are left alone, as zor leaves them).
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cmath>
#include <cstdint>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;

struct Images {
    cv::Mat c3 = cv::Mat(kH, kW, CV_8UC3), c1 = cv::Mat(kH, kW, CV_8UC1);
    cv::Mat c3out = cv::Mat(720, 1280, CV_8UC3, cv::Scalar::all(0)), c1out = cv::Mat(kH, kW, CV_8UC1, cv::Scalar(0));
    double shrink[2][3], turn[2][3];  // 1920 x 1080 -> 1280 x 720 turned by 10 degrees; 30 degrees about the centre
    cv::Mat shrinkM, turnM;
    Images() {
        cv::randu(c3, 0, 256);
        cv::randu(c1, 0, 256);
        shrinkM = cv::getRotationMatrix2D(cv::Point2f(960, 540), 10, 2.0 / 3);
        shrinkM.at<double>(0, 2) += 640 - 960;
        shrinkM.at<double>(1, 2) += 360 - 540;
        double xs = 0, ys = 0;
        zoriGetRotateShift(960, 540, 30, &xs, &ys);
        const double co = std::cos(30.0 / 180 * 3.141592653589793), si = std::sin(30.0 / 180 * 3.141592653589793);
        const double c[2][3] = {{co, si, xs}, {-si, co, ys}};
        turnM = cv::Mat(2, 3, CV_64F);
        for (int r = 0; r < 2; ++r)
            for (int k = 0; k < 3; ++k) shrink[r][k] = shrinkM.at<double>(r, k), turnM.at<double>(r, k) = turn[r][k] = c[r][k];
    }
};
Images& img() {
    static Images i;
    return i;
}

void zorAffineC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriWarpAffine_8u_C3R(m.c3.data, {kW, kH}, int(m.c3.step), {0, 0, kW, kH}, m.c3out.data,
                                                       int(m.c3out.step), {0, 0, 1280, 720}, m.shrink, InterLinear));
}
void cvAffineC3(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::warpAffine(m.c3, m.c3out, m.shrinkM, m.c3out.size(), cv::INTER_LINEAR, cv::BORDER_TRANSPARENT);
        benchmark::ClobberMemory();
    }
}

void zorRotateC1(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st)
        benchmark::DoNotOptimize(zoriRotate_8u_C1R(m.c1.data, {kW, kH}, int(m.c1.step), {0, 0, kW, kH}, m.c1out.data,
                                                   int(m.c1out.step), {0, 0, kW, kH}, 30, m.turn[0][2], m.turn[1][2],
                                                   InterLinear));
}
void cvRotateC1(benchmark::State& st) {
    Images& m = img();
    for (auto _ : st) {
        cv::warpAffine(m.c1, m.c1out, m.turnM, m.c1out.size(), cv::INTER_LINEAR, cv::BORDER_TRANSPARENT);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(warp_affine_c3, "zoriWarpAffine_8u_C3R linear 1920x1080 -> 1280x720, 10 deg", zorAffineC3, cvAffineC3,
        "cv::warpAffine INTER_LINEAR, BORDER_TRANSPARENT", 1.0);
ZB_PAIR(rotate_c1, "zoriRotate_8u_C1R 30 deg linear 1920x1080", zorRotateC1, cvRotateC1,
        "cv::warpAffine of the same matrix", 1.0);
