// Vector conversions and the Hamming window.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include <cmath>
#include <cstdint>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kLen = 64 * 1024;
constexpr int kWin = 1024;

template <class T>
std::vector<T> ramp(int n, double scale) {
    std::vector<T> v(n);
    for (int i = 0; i < n; ++i) v[i] = static_cast<T>(std::sin(i * 0.001) * scale);
    return v;
}

// ---- 32f to 16s, round to nearest, no scaling ----
void zorConvert32f16s(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kLen, 40000.0);
    std::vector<int16_t> dst(kLen);
    for (auto _ : state) {
        zorsConvert_32f16s_Sfs(src.data(), dst.data(), kLen, RoundNear, 0);
        benchmark::DoNotOptimize(dst.data());
    }
}
void cvConvert32f16s(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kLen, 40000.0);
    std::vector<int16_t> dst(kLen);
    const cv::Mat s(1, kLen, CV_32F, const_cast<float*>(src.data()));
    cv::Mat d(1, kLen, CV_16S, dst.data());
    for (auto _ : state) {
        s.convertTo(d, CV_16S);
        benchmark::DoNotOptimize(dst.data());
    }
}

// ---- 16s to 32f ----
void zorConvert16s32f(benchmark::State& state) {
    const std::vector<int16_t> src = ramp<int16_t>(kLen, 32000.0);
    std::vector<float> dst(kLen);
    for (auto _ : state) {
        zorsConvert_16s32f(src.data(), dst.data(), kLen);
        benchmark::DoNotOptimize(dst.data());
    }
}
void cvConvert16s32f(benchmark::State& state) {
    const std::vector<int16_t> src = ramp<int16_t>(kLen, 32000.0);
    std::vector<float> dst(kLen);
    const cv::Mat s(1, kLen, CV_16S, const_cast<int16_t*>(src.data()));
    cv::Mat d(1, kLen, CV_32F, dst.data());
    for (auto _ : state) {
        s.convertTo(d, CV_32F);
        benchmark::DoNotOptimize(dst.data());
    }
}

// ---- 8u to 32f ----
void zorConvert8u32f(benchmark::State& state) {
    const std::vector<uint8_t> src = ramp<uint8_t>(kLen, 127.0);
    std::vector<float> dst(kLen);
    for (auto _ : state) {
        zorsConvert_8u32f(src.data(), dst.data(), kLen);
        benchmark::DoNotOptimize(dst.data());
    }
}
void cvConvert8u32f(benchmark::State& state) {
    const std::vector<uint8_t> src = ramp<uint8_t>(kLen, 127.0);
    std::vector<float> dst(kLen);
    const cv::Mat s(1, kLen, CV_8U, const_cast<uint8_t*>(src.data()));
    cv::Mat d(1, kLen, CV_32F, dst.data());
    for (auto _ : state) {
        s.convertTo(d, CV_32F);
        benchmark::DoNotOptimize(dst.data());
    }
}

// ---- Hamming window of 1024 samples ----
std::vector<float> hammingTable(int n) {
    std::vector<float> w(n);
    for (int i = 0; i < n; ++i) w[i] = float(0.54 - 0.46 * std::cos(6.283185307179586 * i / (n - 1)));
    return w;
}
void zorHamming(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0);
    std::vector<float> dst(kWin);
    for (auto _ : state) {
        zorsWinHamming_32f(src.data(), dst.data(), kWin);
        benchmark::DoNotOptimize(dst.data());
    }
}
void loopHamming(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0), w = hammingTable(kWin);
    std::vector<float> dst(kWin);
    for (auto _ : state) {
        const float* s = src.data();
        const float* pw = w.data();
        float* d = dst.data();
        for (int i = 0; i < kWin; ++i) d[i] = s[i] * pw[i];
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
}
// Alternating two lengths: every call rebuilds its weights, which is what a
// window applied once costs.
void zorHammingAlternating(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0);
    std::vector<float> dst(kWin);
    int n = kWin;
    for (auto _ : state) {
        zorsWinHamming_32f(src.data(), dst.data(), n);
        n = 2 * kWin - 1 - n;
        benchmark::DoNotOptimize(dst.data());
    }
}
void loopHammingAlternating(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0);
    const std::vector<float> w[2] = {hammingTable(kWin), hammingTable(kWin - 1)};
    std::vector<float> dst(kWin);
    int k = 0;
    for (auto _ : state) {
        const int n = kWin - k;
        const float* s = src.data();
        const float* pw = w[k].data();
        float* d = dst.data();
        for (int i = 0; i < n; ++i) d[i] = s[i] * pw[i];
        k ^= 1;
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
}
// The same rule as zor's: each product formed in double from a window of
// doubles and rounded once to float.
ZB_WIDEST_CLONES void weighInDouble(const float* s, const double* w, float* d, int n) {
    for (int i = 0; i < n; ++i) d[i] = static_cast<float>(double(s[i]) * w[i]);
}
void loopHammingDouble(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0);
    std::vector<double> w(kWin);
    for (int i = 0; i < kWin; ++i) w[i] = 0.54 - 0.46 * std::cos(6.283185307179586 * i / (kWin - 1));
    std::vector<float> dst(kWin);
    for (auto _ : state) {
        weighInDouble(src.data(), w.data(), dst.data(), kWin);
        benchmark::DoNotOptimize(dst.data());
        benchmark::ClobberMemory();
    }
}
void cvHamming(benchmark::State& state) {
    const std::vector<float> src = ramp<float>(kWin, 1.0), w = hammingTable(kWin);
    std::vector<float> dst(kWin);
    const cv::Mat s(1, kWin, CV_32F, const_cast<float*>(src.data()));
    const cv::Mat mw(1, kWin, CV_32F, const_cast<float*>(w.data()));
    cv::Mat d(1, kWin, CV_32F, dst.data());
    for (auto _ : state) {
        cv::multiply(s, mw, d);
        benchmark::DoNotOptimize(dst.data());
    }
}

}  // namespace

ZB_PAIR(cvt_32f16s, "zorsConvert_32f16s_Sfs RoundNear sf 0, 64Ki", zorConvert32f16s, cvConvert32f16s,
        "cv::Mat::convertTo(CV_16S)", 1.0);
ZB_PAIR(cvt_16s32f, "zorsConvert_16s32f 64Ki", zorConvert16s32f, cvConvert16s32f,
        "cv::Mat::convertTo(CV_32F)", 1.0);
ZB_PAIR(cvt_8u32f_vec, "zorsConvert_8u32f 64Ki", zorConvert8u32f, cvConvert8u32f,
        "cv::Mat::convertTo(CV_32F)", 1.0);
ZB_PAIR(win_hamming, "zorsWinHamming_32f 1024", zorHamming, loopHamming,
        "loop over a precomputed window", 2.0);
ZB_PAIR(win_hamming_fresh, "zorsWinHamming_32f 1024/1023 alternating", zorHammingAlternating,
        loopHammingAlternating, "loop over two precomputed windows", 0);
ZB_PAIR(win_hamming_d, "zorsWinHamming_32f 1024 (same rule)", zorHamming, loopHammingDouble,
        "loop over a precomputed window in double", 0);
ZB_PAIR(win_hamming_cv, "zorsWinHamming_32f 1024 (vs cv)", zorHamming, cvHamming,
        "cv::multiply by a precomputed window", 0);
