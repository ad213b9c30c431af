// Image filters on 1920 x 1080 single-channel images.  zor reads its
// neighbourhoods from a source that carries a replicated 2-pixel border
// around the ROI; OpenCV filters the plain image with its own replicated
// border.
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

constexpr int kW = 1920, kH = 1080, kB = 3;

// The test picture, with a border and its derivatives.
struct Scene {
    cv::Mat plain;    // kW x kH
    cv::Mat padded;   // plain with a replicated border of kB pixels
    cv::Mat dx, dy;   // Sobel derivatives (16s) of plain
    Scene() : plain(zb::testPicture(kW, kH)) {
        cv::copyMakeBorder(plain, padded, kB, kB, kB, kB, cv::BORDER_REPLICATE);
        cv::Sobel(plain, dx, CV_16S, 1, 0, 3, 1, 0, cv::BORDER_REPLICATE);
        cv::Sobel(plain, dy, CV_16S, 0, 1, 3, 1, 0, cv::BORDER_REPLICATE);
    }
    const uint8_t* roi() const { return padded.ptr<uint8_t>(kB) + kB; }
    int step() const { return int(padded.step); }
};

const Scene& scene() {
    static const Scene s;
    return s;
}

constexpr ImageSize kRoi{kW, kH};

const int32_t kKernel[25] = {1, 1, 2, 1, 1, 1, 2, 3, 2, 1, 2, 3, 5, 3, 2,
                             1, 2, 3, 2, 1, 1, 1, 2, 1, 1};  // sums to 45, symmetric

cv::Mat floatKernel() {
    cv::Mat k(5, 5, CV_32F);
    for (int i = 0; i < 25; ++i) k.at<float>(i / 5, i % 5) = float(kKernel[i]) / 45.0f;
    return k;
}

// ---- linear ------------------------------------------------------------------

void zorFilterInt(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st)
        zoriFilter_8u_C1R(s.roi(), s.step(), dst.data, int(dst.step), kRoi, kKernel, {5, 5}, {2, 2}, 45);
}
void zorFilterFloat(benchmark::State& st) {
    const Scene& s = scene();
    const cv::Mat k = floatKernel();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st)
        zoriFilter32f_8u_C1R(s.roi(), s.step(), dst.data, int(dst.step), kRoi, k.ptr<float>(), {5, 5}, {2, 2});
}
void cvFilter(benchmark::State& st) {
    const Scene& s = scene();
    const cv::Mat k = floatKernel();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st) cv::filter2D(s.plain, dst, CV_8U, k, cv::Point(-1, -1), 0, cv::BORDER_REPLICATE);
}

// ---- Sobel -------------------------------------------------------------------

template <int Mask>
void zorSobelVert(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_16SC1);
    for (auto _ : st)
        zoriFilterSobelVert_8u16s_C1R(s.roi(), s.step(), dst.ptr<int16_t>(), int(dst.step), kRoi, Mask);
}
template <int K>
void cvSobel(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_16SC1);
    for (auto _ : st) cv::Sobel(s.plain, dst, CV_16S, 1, 0, K, 1, 0, cv::BORDER_REPLICATE);
}

// ---- rank --------------------------------------------------------------------

template <int M>
void zorMedian(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st)
        zoriFilterMedian_8u_C1R(s.roi(), s.step(), dst.data, int(dst.step), kRoi, {M, M}, {M / 2, M / 2});
}
template <int M>
void cvMedian(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st) cv::medianBlur(s.plain, dst, M);
}

void zorMax(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st) zoriFilterMax_8u_C1R(s.roi(), s.step(), dst.data, int(dst.step), kRoi, {3, 3}, {1, 1});
}
void cvDilate(benchmark::State& st) {
    const Scene& s = scene();
    const cv::Mat k = cv::getStructuringElement(cv::MORPH_RECT, cv::Size(3, 3));
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st) cv::dilate(s.plain, dst, k, cv::Point(-1, -1), 1, cv::BORDER_REPLICATE);
}

// ---- morphology ----------------------------------------------------------------

void zorDilateInPlace(benchmark::State& st) {
    cv::Mat work = scene().padded.clone();
    uint8_t* roi = work.ptr<uint8_t>(kB) + kB;
    for (auto _ : st) zoriDilate3x3_8u_C1IR(roi, int(work.step), kRoi);
}

// ---- Canny ---------------------------------------------------------------------

void zorCanny(benchmark::State& st) {
    const Scene& s = scene();
    int size = 0;
    zoriCannyGetSize(kRoi, &size);
    std::vector<uint8_t> buffer{std::vector<uint8_t>(static_cast<size_t>(size))};
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st)
        zoriCanny_16s8u_C1R(s.dx.ptr<int16_t>(), int(s.dx.step), s.dy.ptr<int16_t>(), int(s.dy.step), dst.data,
                            int(dst.step), kRoi, 100.0f, 200.0f, buffer.data());
}
void cvCanny(benchmark::State& st) {
    const Scene& s = scene();
    cv::Mat dst(kH, kW, CV_8UC1);
    for (auto _ : st) cv::Canny(s.dx, s.dy, dst, 100, 200, false);
}

}  // namespace

ZB_PAIR(filter_int5, "zoriFilter_8u_C1R 5x5 /45 1920x1080", zorFilterInt, cvFilter, "cv::filter2D 5x5 float", 0.7);
ZB_PAIR(filter_f5, "zoriFilter32f_8u_C1R 5x5 1920x1080", zorFilterFloat, cvFilter, "cv::filter2D 5x5 float", 1.0);
ZB_PAIR(sobel_v3, "zoriFilterSobelVert_8u16s_C1R 33 1920x1080", zorSobelVert<33>, cvSobel<3>, "cv::Sobel 16S dx ksize 3", 1.0);
ZB_PAIR(sobel_v5, "zoriFilterSobelVert_8u16s_C1R 55 1920x1080", zorSobelVert<55>, cvSobel<5>, "cv::Sobel 16S dx ksize 5", 1.0);
ZB_PAIR(median3, "zoriFilterMedian_8u_C1R 3x3 1920x1080", zorMedian<3>, cvMedian<3>, "cv::medianBlur 3", 1.0);
ZB_PAIR(median5, "zoriFilterMedian_8u_C1R 5x5 1920x1080", zorMedian<5>, cvMedian<5>, "cv::medianBlur 5", 1.0);
ZB_PAIR(median7, "zoriFilterMedian_8u_C1R 7x7 1920x1080", zorMedian<7>, cvMedian<7>, "cv::medianBlur 7", 1.0);
ZB_PAIR(max3, "zoriFilterMax_8u_C1R 3x3 1920x1080", zorMax, cvDilate, "cv::dilate 3x3", 1.0);
ZB_PAIR(dilate3, "zoriDilate3x3_8u_C1IR 1920x1080", zorDilateInPlace, cvDilate, "cv::dilate 3x3 (not in place)", 1.2);
ZB_PAIR(canny, "zoriCanny_16s8u_C1R 100/200 1920x1080", zorCanny, cvCanny, "cv::Canny(dx, dy) L1", 0.5);
