// Geometric transforms on 1920 x 1080 pictures: resize against cv::resize
// with the same sizes (OpenCV derives the same factors from them).
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cmath>
#include <cstdint>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;

// A deterministic picture: smooth shading, edges, mild noise.
cv::Mat scene(int type) {
    cv::Mat m(kH, kW, CV_8UC3);
    uint32_t r = 4321;
    for (int y = 0; y < kH; ++y)
        for (int x = 0; x < kW; ++x)
            for (int c = 0; c < 3; ++c) {
                r = r * 1664525u + 1013904223u;
                double v = 120 + 60 * std::sin((x + 40 * c) / 61.0) * std::cos(y / 37.0);
                if ((x / 128 + y / 96) % 3 == c) v += 50;
                m.at<cv::Vec3b>(y, x)[c] = cv::saturate_cast<uint8_t>(v + double(r >> 28) - 8);
            }
    cv::Mat out;
    if (CV_MAT_CN(type) == 1) cv::cvtColor(m, out, cv::COLOR_BGR2GRAY);
    else out = m;
    if (CV_MAT_DEPTH(type) == CV_32F) out.convertTo(out, CV_32F, 1 / 255.0);
    return out;
}

const cv::Mat& picture(int type) {
    static const cv::Mat c3 = scene(CV_8UC3), c1 = scene(CV_8UC1), f1 = scene(CV_32FC1);
    return type == CV_8UC3 ? c3 : type == CV_8UC1 ? c1 : f1;
}

template <class T>
using ResizeFn = Status(ZOR_CALL*)(const T*, ImageSize, int, ImageRect, T*, int, ImageSize, double, double, int);

template <class T>
void zorResize(benchmark::State& st, ResizeFn<T> fn, int type, int dw, int dh, int mode) {
    const cv::Mat& s = picture(type);
    cv::Mat d(dh, dw, type);
    for (auto _ : st)
        fn(s.ptr<T>(), {kW, kH}, int(s.step), {0, 0, kW, kH}, d.ptr<T>(), int(d.step), {dw, dh}, double(dw) / kW,
           double(dh) / kH, mode);
}
void cvResize(benchmark::State& st, int type, int dw, int dh, int mode) {
    const cv::Mat& s = picture(type);
    cv::Mat d(dh, dw, type);
    for (auto _ : st) cv::resize(s, d, cv::Size(dw, dh), 0, 0, mode);
}

void zorLinearC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 1280, 720, InterLinear); }
void cvLinearC3(benchmark::State& st) { cvResize(st, CV_8UC3, 1280, 720, cv::INTER_LINEAR); }
void zorCubicC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 1280, 720, InterCubic); }
void cvCubicC3(benchmark::State& st) { cvResize(st, CV_8UC3, 1280, 720, cv::INTER_CUBIC); }
void zorSuperC1(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C1R, CV_8UC1, 960, 540, InterSuper); }
void cvAreaC1(benchmark::State& st) { cvResize(st, CV_8UC1, 960, 540, cv::INTER_AREA); }
void zorLinearF1(benchmark::State& st) { zorResize<float>(st, zoriResize_32f_C1R, CV_32FC1, 1280, 720, InterLinear); }
void cvLinearF1(benchmark::State& st) { cvResize(st, CV_32FC1, 1280, 720, cv::INTER_LINEAR); }
// without targets: super-sampling by 2/3 and Lanczos (OpenCV's has 4 lobes)
void zorSuperC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 1280, 720, InterSuper); }
void cvAreaC3(benchmark::State& st) { cvResize(st, CV_8UC3, 1280, 720, cv::INTER_AREA); }
void zorLanczosC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 1280, 720, InterLanczos); }
void cvLanczosC3(benchmark::State& st) { cvResize(st, CV_8UC3, 1280, 720, cv::INTER_LANCZOS4); }

}  // namespace

ZB_PAIR(resize_lin_c3, "zoriResize_8u_C3R linear 1920x1080>1280x720", zorLinearC3, cvLinearC3, "cv::resize INTER_LINEAR", 1.0);
ZB_PAIR(resize_cub_c3, "zoriResize_8u_C3R cubic 1920x1080>1280x720", zorCubicC3, cvCubicC3, "cv::resize INTER_CUBIC", 1.0);
ZB_PAIR(resize_sup_c1, "zoriResize_8u_C1R super 1920x1080>960x540", zorSuperC1, cvAreaC1, "cv::resize INTER_AREA", 1.0);
ZB_PAIR(resize_lin_f1, "zoriResize_32f_C1R linear 1920x1080>1280x720", zorLinearF1, cvLinearF1, "cv::resize INTER_LINEAR", 1.0);
ZB_PAIR(resize_sup_c3, "zoriResize_8u_C3R super 1920x1080>1280x720", zorSuperC3, cvAreaC3, "cv::resize INTER_AREA", 0);
ZB_PAIR(resize_lan_c3, "zoriResize_8u_C3R Lanczos 1920x1080>1280x720", zorLanczosC3, cvLanczosC3, "cv::resize INTER_LANCZOS4", 0);
namespace {
void zorThumbC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 160, 90, InterSuper); }
void cvThumbC3(benchmark::State& st) { cvResize(st, CV_8UC3, 160, 90, cv::INTER_AREA); }
void zorNearestC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 1280, 720, InterNearest); }
void cvNearestC3(benchmark::State& st) { cvResize(st, CV_8UC3, 1280, 720, cv::INTER_NEAREST); }
void zorUpC3(benchmark::State& st) { zorResize<uint8_t>(st, zoriResize_8u_C3R, CV_8UC3, 2880, 1620, InterLinear); }
void cvUpC3(benchmark::State& st) { cvResize(st, CV_8UC3, 2880, 1620, cv::INTER_LINEAR); }
}
ZB_PAIR(resize_thumb_c3, "zoriResize_8u_C3R super 1920x1080>160x90", zorThumbC3, cvThumbC3, "cv::resize INTER_AREA", 0);
ZB_PAIR(resize_nn_c3, "zoriResize_8u_C3R nearest 1920x1080>1280x720", zorNearestC3, cvNearestC3, "cv::resize INTER_NEAREST", 0);
ZB_PAIR(resize_up_c3, "zoriResize_8u_C3R linear 1920x1080>2880x1620", zorUpC3, cvUpC3, "cv::resize INTER_LINEAR", 0);
