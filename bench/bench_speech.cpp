// Speech front end: 25 ms / 10 ms MFCC frames over one minute of 16 kHz audio.
#include <benchmark/benchmark.h>
#include <fftw3.h>

#include <cmath>
#include <random>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kRate = 16000;
constexpr int kWin = 400;   // 25 ms
constexpr int kHop = 160;   // 10 ms
constexpr int kFft = 512;
constexpr int kFilters = 26;
constexpr int kCeps = 13;
constexpr int kFrames = (60 * kRate - kWin) / kHop + 1;

const std::vector<float>& audio() {
    static const std::vector<float> a = [] {
        std::mt19937 g(11);
        std::normal_distribution<float> d(0.0f, 0.1f);
        std::vector<float> v(60 * kRate);
        for (size_t i = 0; i < v.size(); ++i)
            v[i] = 0.3f * std::sin(0.05f * static_cast<float>(i % 6283)) + d(g);
        return v;
    }();
    return a;
}

void zorMfcc(benchmark::State& state) {
    const auto& x = audio();
    void* bank = nullptr;
    int order = 0;
    zorsMelFBankInitAlloc_32f(&bank, &order, kFft, kRate, 64, 8000, kFilters, 2595, 700, 1 | 4);
    void* dct = nullptr;
    zorsDCTLifterInitAlloc_32f(&dct, kFilters, kCeps, 22, 1.0f);
    std::vector<float> frame(kFft), energies(kFilters), ceps(kCeps * kFrames), window(kWin);
    zorsSet_32f(1.0f, window.data(), kWin);
    zorsWinHamming_32f_I(window.data(), kWin);  // the weights once, then a multiply per frame
    zorsZero_32f(frame.data(), kFft);            // the padding stays zero: nothing writes there
    for (auto _ : state) {
        for (int f = 0; f < kFrames; ++f) {
            zorsCopy_32f(x.data() + f * kHop, frame.data(), kWin);
            zorsPreemphasize_32f(frame.data(), kWin, 0.97f);
            zorsMul_32f_I(window.data(), frame.data(), kWin);
            zorsEvalFBank_32f(frame.data(), energies.data(), bank);
            zorsThreshold_LTVal_32f_I(energies.data(), kFilters, 1e-10f, 1e-10f);
            zorsLn_32f_I(energies.data(), kFilters);
            zorsDCTLifter_32f(energies.data(), ceps.data() + f * kCeps, dct);
        }
        benchmark::ClobberMemory();
    }
    state.counters["frames/s"] = benchmark::Counter(static_cast<double>(kFrames) * state.iterations(),
                                                    benchmark::Counter::kIsRate);
    zorsDCTLifterFree_32f(dct);
    zorsFBankFree_32f(bank);
}

// The same pipeline from FFTW and plain loops.
void fftwMfcc(benchmark::State& state) {
    const auto& x = audio();
    float* in = fftwf_alloc_real(kFft);
    fftwf_complex* out = fftwf_alloc_complex(kFft / 2 + 1);
    fftwf_plan plan = fftwf_plan_dft_r2c_1d(kFft, in, out, FFTW_MEASURE);
    // Hamming weights, triangular mel filters as (first bin, weights), DCT-lifter matrix
    std::vector<float> ham(kWin);
    for (int n = 0; n < kWin; ++n) ham[n] = static_cast<float>(0.54 - 0.46 * std::cos(2 * 3.141592653589793 * n / (kWin - 1)));
    auto mel = [](double f) { return 2595.0 * std::log(1 + f / 700.0); };
    const double ml = mel(64), mh = mel(8000);
    std::vector<int> bins(kFilters + 2);
    for (int k = 0; k < kFilters + 2; ++k) {
        const double m = ml + k * (mh - ml) / (kFilters + 1);
        bins[k] = static_cast<int>(kFft / double(kRate) * 700.0 * (std::exp(m / 2595.0) - 1));
    }
    std::vector<std::vector<float>> w(kFilters);
    for (int k = 1; k <= kFilters; ++k)
        for (int i = bins[k - 1]; i <= bins[k + 1]; ++i) {
            const float v = i <= bins[k] ? float(i - bins[k - 1]) / std::max(1, bins[k] - bins[k - 1])
                                         : float(bins[k + 1] - i) / std::max(1, bins[k + 1] - bins[k]);
            w[k - 1].push_back(v);
        }
    std::vector<float> dctm(kCeps * kFilters);
    for (int i = 1; i <= kCeps; ++i)
        for (int j = 0; j < kFilters; ++j)
            dctm[(i - 1) * kFilters + j] = static_cast<float>(
                std::cos((j + 0.5) * i * 3.141592653589793 / kFilters) * (1 + 11 * std::sin(i * 3.141592653589793 / 22)));
    std::vector<float> mag(kFft / 2 + 1), e(kFilters), ceps(kCeps * kFrames);
    for (auto _ : state) {
        for (int f = 0; f < kFrames; ++f) {
            const float* s = x.data() + f * kHop;
            in[0] = s[0] * ham[0];
            for (int n = 1; n < kWin; ++n) in[n] = (s[n] - 0.97f * s[n - 1]) * ham[n];
            for (int n = kWin; n < kFft; ++n) in[n] = 0;
            fftwf_execute(plan);
            for (int k = 0; k <= kFft / 2; ++k) mag[k] = std::sqrt(out[k][0] * out[k][0] + out[k][1] * out[k][1]);
            for (int k = 0; k < kFilters; ++k) {
                float acc = 0;
                const int a = bins[k];
                for (size_t i = 0; i < w[k].size(); ++i) acc += w[k][i] * mag[a + i];
                e[k] = std::log(std::max(acc, 1e-10f));
            }
            for (int i = 0; i < kCeps; ++i) {
                float acc = 0;
                for (int j = 0; j < kFilters; ++j) acc += dctm[i * kFilters + j] * e[j];
                ceps[f * kCeps + i] = acc;
            }
        }
        benchmark::ClobberMemory();
    }
    state.counters["frames/s"] = benchmark::Counter(static_cast<double>(kFrames) * state.iterations(),
                                                    benchmark::Counter::kIsRate);
    fftwf_destroy_plan(plan);
    fftwf_free(in);
    fftwf_free(out);
}

}  // namespace

ZB_PAIR(mfcc, "MFCC 25/10 ms, FFT 512, 26 mel, 13 ceps, 1 min 16 kHz", zorMfcc, fftwMfcc,
        "FFTW r2c + plain loops", 1.0);
