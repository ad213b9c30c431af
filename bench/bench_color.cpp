// Colour conversions and the JPEG forward transform at 1920 x 1080, single
// thread, against OpenCV (cvtColor; cv::dct on each 8 x 8 block).
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>

#include <cstdint>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kW = 1920, kH = 1080;
const ImageSize kRoi = {kW, kH};

struct Images {
    cv::Mat c3, c3out = cv::Mat(kH, kW, CV_8UC3), c1out = cv::Mat(kH, kW, CV_8UC1);
    cv::Mat i420 = cv::Mat(kH * 3 / 2, kW, CV_8UC1);
    std::vector<int16_t> coeffs = std::vector<int16_t>(size_t(kW) * kH);
    uint16_t table[64];
    float reciprocal[64];
    Images() : c3(kH, kW, CV_8UC3) {
        cv::randu(c3, cv::Scalar::all(0), cv::Scalar::all(255));
        i420.setTo(0);
        c3out.setTo(0);
        c1out.setTo(0);
        uint8_t raw[64];
        for (int i = 0; i < 64; ++i) raw[i] = uint8_t(1 + i % 23);
        zoriQuantFwdTableInit_JPEG_8u16u(raw, table);
        for (int i = 0; i < 64; ++i) reciprocal[i] = table[i] / 32768.0f;
    }
};
Images& img() {
    static Images i;
    return i;
}

template <Status(ZOR_CALL* Fn)(const uint8_t*, int, uint8_t*, int, ImageSize), int Channels>
void zorC3(benchmark::State& st) {
    Images& m = img();
    cv::Mat& out = Channels == 3 ? m.c3out : m.c1out;
    for (auto _ : st) benchmark::DoNotOptimize(Fn(m.c3.data, int(m.c3.step), out.data, int(out.step), kRoi));
}
template <int Code, int Channels>
void cvConvert(benchmark::State& st) {
    Images& m = img();
    cv::Mat& out = Code == cv::COLOR_BGR2YUV_I420 ? m.i420 : Channels == 3 ? m.c3out : m.c1out;
    for (auto _ : st) {
        cv::cvtColor(m.c3, out, Code);
        benchmark::ClobberMemory();
    }
}

void zorI420(benchmark::State& st) {
    Images& m = img();
    uint8_t* planes[3] = {m.i420.data, m.i420.data + kW * kH, m.i420.data + kW * kH * 5 / 4};
    const int steps[3] = {kW, kW / 2, kW / 2};
    for (auto _ : st) benchmark::DoNotOptimize(zoriBGRToYCbCr420_8u_C3P3R(m.c3.data, int(m.c3.step), planes, steps, kRoi));
}

// The green plane as the 8 x 8 blocks' source.
const cv::Mat& plane() {
    static const cv::Mat p = [] {
        cv::Mat g;
        cv::extractChannel(img().c3, g, 1);
        return g;
    }();
    return p;
}

void zorDct(benchmark::State& st) {
    Images& m = img();
    const cv::Mat& p = plane();
    for (auto _ : st) {
        int16_t* out = m.coeffs.data();
        for (int y = 0; y < kH; y += 8)
            for (int x = 0; x < kW; x += 8, out += 64)
                zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(p.ptr<uint8_t>(y) + x, int(p.step), out, m.table);
        benchmark::ClobberMemory();
    }
}
void cvDct(benchmark::State& st) {
    Images& m = img();
    const cv::Mat& p = plane();
    cv::Mat block(8, 8, CV_32F), freq(8, 8, CV_32F), recip(8, 8, CV_32F, m.reciprocal);
    for (auto _ : st) {
        int16_t* out = m.coeffs.data();
        for (int y = 0; y < kH; y += 8)
            for (int x = 0; x < kW; x += 8, out += 64) {
                p(cv::Rect(x, y, 8, 8)).convertTo(block, CV_32F, 1.0, -128.0);
                cv::dct(block, freq);
                cv::multiply(freq, recip, freq);
                cv::Mat q(8, 8, CV_16S, out);
                freq.convertTo(q, CV_16S);
            }
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(ycbcr, "zoriRGBToYCbCr_8u_C3R 1920x1080", (zorC3<zoriRGBToYCbCr_8u_C3R, 3>),
        (cvConvert<cv::COLOR_RGB2YCrCb, 3>), "cv::cvtColor RGB2YCrCb", 0.8);
ZB_PAIR(ycbcr_inv, "zoriYCbCrToRGB_8u_C3R 1920x1080", (zorC3<zoriYCbCrToRGB_8u_C3R, 3>),
        (cvConvert<cv::COLOR_YCrCb2RGB, 3>), "cv::cvtColor YCrCb2RGB", 0.8);
ZB_PAIR(gray, "zoriRGBToGray_8u_C3C1R 1920x1080", (zorC3<zoriRGBToGray_8u_C3C1R, 1>),
        (cvConvert<cv::COLOR_RGB2GRAY, 1>), "cv::cvtColor RGB2GRAY", 1.0);
ZB_PAIR(hsv, "zoriRGBToHSV_8u_C3R 1920x1080", (zorC3<zoriRGBToHSV_8u_C3R, 3>),
        (cvConvert<cv::COLOR_RGB2HSV_FULL, 3>), "cv::cvtColor RGB2HSV_FULL", 1.0);
ZB_PAIR(i420, "zoriBGRToYCbCr420_8u_C3P3R 1920x1080", zorI420, (cvConvert<cv::COLOR_BGR2YUV_I420, 1>),
        "cv::cvtColor BGR2YUV_I420", 1.0);
ZB_PAIR(dct, "zoriDCTQuantFwd8x8LS_JPEG 8x8 blocks 1920x1080", zorDct, cvDct,
        "cv::dct per block (float) + quantisation", 0.3);
