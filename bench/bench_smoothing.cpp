// Smoothing filters on 1920 x 1080 images, single thread.  Both sides filter
// the same interior ROI of one padded image: zor reads the pixels around its
// ROI; OpenCV gets the ROI as a view into the padded image and, without
// BORDER_ISOLATED, reads the same real pixels around it instead of
// extrapolating, so neither pays for synthesising a border.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cstdint>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080, kB = 8;
constexpr ImageSize kRoi{kW, kH};

struct Padded {
    cv::Mat full;  // (kW + 2 kB) x (kH + 2 kB)
    cv::Mat roi;   // the interior view
    explicit Padded(int type) : full(kH + 2 * kB, kW + 2 * kB, type) {
        cv::randu(full, cv::Scalar::all(0), cv::Scalar::all(256));
        cv::GaussianBlur(full, full, cv::Size(7, 7), 0);  // a picture rather than noise
        roi = full(cv::Rect(kB, kB, kW, kH));
    }
    const uint8_t* p() const { return roi.ptr<uint8_t>(); }
    int step() const { return int(full.step); }
};

const Padded& gray() {
    static const Padded p(CV_8UC1);
    return p;
}
const Padded& colour() {
    static const Padded p(CV_8UC3);
    return p;
}

template <int M, int Channels>
void zorBox(benchmark::State& st) {
    const Padded& s = Channels == 1 ? gray() : colour();
    cv::Mat dst(kH, kW, s.full.type());
    auto f = Channels == 1 ? zoriFilterBox_8u_C1R : zoriFilterBox_8u_C3R;
    for (auto _ : st) f(s.p(), s.step(), dst.data, int(dst.step), kRoi, {M, M}, {M / 2, M / 2});
}
template <int M, int Channels>
void cvBlur(benchmark::State& st) {
    const Padded& s = Channels == 1 ? gray() : colour();
    cv::Mat dst(kH, kW, s.full.type());
    for (auto _ : st) cv::blur(s.roi, dst, cv::Size(M, M), cv::Point(-1, -1), cv::BORDER_REPLICATE);
}

template <int Mask, int Channels>
void zorGauss(benchmark::State& st) {
    const Padded& s = Channels == 1 ? gray() : colour();
    cv::Mat dst(kH, kW, s.full.type());
    auto f = Channels == 1 ? zoriFilterGauss_8u_C1R : zoriFilterGauss_8u_C3R;
    for (auto _ : st) f(s.p(), s.step(), dst.data, int(dst.step), kRoi, Mask);
}
// sigma 0 at sizes 3 and 5 takes OpenCV's fixed [1 2 1] / 4 and [1 4 6 4 1] / 16
template <int K, int Channels>
void cvGauss(benchmark::State& st) {
    const Padded& s = Channels == 1 ? gray() : colour();
    cv::Mat dst(kH, kW, s.full.type());
    for (auto _ : st) cv::GaussianBlur(s.roi, dst, cv::Size(K, K), 0, 0, cv::BORDER_REPLICATE);
}

// Full convolution of a 512 x 512 image with a 9 x 9 kernel; the peer
// filters the image padded with 8 zeros each side by the flipped kernel
// (float accumulation where zor accumulates in double).
struct ConvData {
    cv::Mat a, k, padded, flipped;
    ConvData() : a(512, 512, CV_32F), k(9, 9, CV_32F) {
        cv::randu(a, -1.0, 1.0);
        cv::randu(k, -1.0, 1.0);
        cv::copyMakeBorder(a, padded, 8, 8, 8, 8, cv::BORDER_CONSTANT, 0);
        cv::flip(k, flipped, -1);
    }
};
const ConvData& conv() {
    static const ConvData c;
    return c;
}
void zorConv(benchmark::State& st) {
    const ConvData& c = conv();
    cv::Mat dst(520, 520, CV_32F);
    for (auto _ : st)
        zoriConvFull_32f_C1R(c.a.ptr<float>(), int(c.a.step), {512, 512}, c.k.ptr<float>(), int(c.k.step), {9, 9},
                             dst.ptr<float>(), int(dst.step));
}
void cvConv(benchmark::State& st) {
    const ConvData& c = conv();
    cv::Mat dst(520, 520, CV_32F);
    for (auto _ : st)
        cv::filter2D(c.padded, dst, CV_32F, c.flipped, cv::Point(8, 8), 0, cv::BORDER_CONSTANT);
}

}  // namespace

ZB_PAIR(box5, "zoriFilterBox_8u_C1R 5x5 1920x1080", (zorBox<5, 1>), (cvBlur<5, 1>), "cv::blur 5x5", 1.0);
ZB_PAIR(gauss55, "zoriFilterGauss_8u_C1R 55 1920x1080", (zorGauss<55, 1>), (cvGauss<5, 1>),
        "cv::GaussianBlur 5x5", 1.0);
ZB_PAIR(box3, "zoriFilterBox_8u_C1R 3x3 1920x1080", (zorBox<3, 1>), (cvBlur<3, 1>), "cv::blur 3x3", 0);
ZB_PAIR(box15, "zoriFilterBox_8u_C1R 15x15 1920x1080", (zorBox<15, 1>), (cvBlur<15, 1>), "cv::blur 15x15", 0);
ZB_PAIR(box5c3, "zoriFilterBox_8u_C3R 5x5 1920x1080", (zorBox<5, 3>), (cvBlur<5, 3>), "cv::blur 5x5", 0);
ZB_PAIR(gauss33, "zoriFilterGauss_8u_C1R 33 1920x1080", (zorGauss<33, 1>), (cvGauss<3, 1>),
        "cv::GaussianBlur 3x3", 0);
ZB_PAIR(gauss55c3, "zoriFilterGauss_8u_C3R 55 1920x1080", (zorGauss<55, 3>), (cvGauss<5, 3>),
        "cv::GaussianBlur 5x5", 0);
ZB_PAIR(convfull, "zoriConvFull_32f_C1R 512x512 * 9x9", zorConv, cvConv, "cv::filter2D on zero-padded (float)", 0);
