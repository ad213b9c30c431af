// Signal transforms: FFT, IIR filter, Gaussian generator.
#include <benchmark/benchmark.h>
#include <fftw3.h>

#include <cstdint>
#include <random>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

std::vector<float> noise(size_t n, unsigned seed) {
    std::mt19937 g(seed);
    std::uniform_real_distribution<float> d(-1.0f, 1.0f);
    std::vector<float> v(n);
    for (float& x : v) x = d(g);
    return v;
}

float* fftwBuf(size_t n, const std::vector<float>& init) {
    float* p = static_cast<float*>(fftwf_malloc(n * sizeof(float)));
    for (size_t i = 0; i < n; ++i) p[i] = i < init.size() ? init[i] : 0.0f;
    return p;
}

// ---- complex FFT, split arrays ----------------------------------------------

template <int Order>
void zorFftC(benchmark::State& state) {
    const int n = 1 << Order;
    void* spec = nullptr;
    zorsFFTInitAlloc_C_32f(&spec, Order, 8, 0);
    const auto re = noise(n, 1), im = noise(n, 2);
    float* dr = zorsMalloc_32f(n);
    float* di = zorsMalloc_32f(n);
    for (auto _ : state) {
        zorsFFTFwd_CToC_32f(re.data(), im.data(), dr, di, spec, nullptr);
        benchmark::ClobberMemory();
    }
    zorsFree(dr);
    zorsFree(di);
    zorsFFTFree_C_32f(spec);
}

template <int Order>
void fftwFftC(benchmark::State& state) {
    const int n = 1 << Order;
    float* ri = fftwBuf(n, noise(n, 1));
    float* ii = fftwBuf(n, noise(n, 2));
    float* ro = fftwBuf(n, {});
    float* io = fftwBuf(n, {});
    fftwf_iodim dim = {n, 1, 1};
    fftwf_plan p = fftwf_plan_guru_split_dft(1, &dim, 0, nullptr, ri, ii, ro, io, FFTW_MEASURE);
    // MEASURE overwrites the arrays while planning
    const auto r0 = noise(n, 1), i0 = noise(n, 2);
    for (int k = 0; k < n; ++k) { ri[k] = r0[k]; ii[k] = i0[k]; }
    for (auto _ : state) {
        fftwf_execute_split_dft(p, ri, ii, ro, io);
        benchmark::ClobberMemory();
    }
    fftwf_destroy_plan(p);
    fftwf_free(ri); fftwf_free(ii); fftwf_free(ro); fftwf_free(io);
}

// ---- real FFT ---------------------------------------------------------------

template <int Order>
void zorFftR(benchmark::State& state) {
    const int n = 1 << Order;
    void* spec = nullptr;
    zorsFFTInitAlloc_R_32f(&spec, Order, 8, 0);
    const auto x = noise(n, 3);
    float* d = zorsMalloc_32f(n + 2);
    for (auto _ : state) {
        zorsFFTFwd_RToCCS_32f(x.data(), d, spec, nullptr);
        benchmark::ClobberMemory();
    }
    zorsFree(d);
    zorsFFTFree_R_32f(spec);
}

template <int Order>
void fftwFftR(benchmark::State& state) {
    const int n = 1 << Order;
    float* in = fftwBuf(n, {});
    fftwf_complex* out = static_cast<fftwf_complex*>(fftwf_malloc((n / 2 + 1) * sizeof(fftwf_complex)));
    fftwf_plan p = fftwf_plan_dft_r2c_1d(n, in, out, FFTW_MEASURE);
    const auto x = noise(n, 3);
    for (int k = 0; k < n; ++k) in[k] = x[k];
    for (auto _ : state) {
        fftwf_execute(p);
        benchmark::ClobberMemory();
    }
    fftwf_destroy_plan(p);
    fftwf_free(in);
    fftwf_free(out);
}

}  // namespace

ZB_PAIR(fft_c_1024, "zorsFFTFwd_CToC_32f N=1024", zorFftC<10>, fftwFftC<10>,
        "FFTW split guru plan, MEASURE", 2.0);
ZB_PAIR(fft_c_4096, "zorsFFTFwd_CToC_32f N=4096", zorFftC<12>, fftwFftC<12>,
        "FFTW split guru plan, MEASURE", 2.0);
ZB_PAIR(fft_r_512, "zorsFFTFwd_RToCCS_32f N=512", zorFftR<9>, fftwFftR<9>,
        "FFTW r2c, MEASURE", 2.0);
ZB_PAIR(fft_r_1024, "zorsFFTFwd_RToCCS_32f N=1024", zorFftR<10>, fftwFftR<10>,
        "FFTW r2c, MEASURE", 2.0);
ZB_PAIR(fft_r_4096, "zorsFFTFwd_RToCCS_32f N=4096", zorFftR<12>, fftwFftR<12>,
        "FFTW r2c, MEASURE", 2.0);

// ---- IIR, order 4 --------------------------------------------------------------

namespace {

constexpr int kIirLen = 64 * 1024;
// A low-pass of order 4 (Butterworth-like, normalised so that a0 = 1).
const float kIirTaps[10] = {0.0048f, 0.0193f, 0.0289f, 0.0193f, 0.0048f,
                            1.0f, -2.3695f, 2.3140f, -1.0547f, 0.1874f};

void zorIir(benchmark::State& state) {
    void* st = nullptr;
    zorsIIRInitAlloc_32f(&st, kIirTaps, 4, nullptr);
    const auto x = noise(kIirLen, 5);
    std::vector<float> y(kIirLen);
    for (auto _ : state) {
        zorsIIR_32f(x.data(), y.data(), kIirLen, st);
        benchmark::ClobberMemory();
    }
    zorsIIRFree_32f(st);
}

// The plain loop: direct form I in double over coefficient arrays.
__attribute__((noinline)) void directForm(const double* b, const double* a, int order,
                                          double* xh, double* yh, const float* x, float* y,
                                          int len) {
    for (int n = 0; n < len; ++n) {
        for (int i = order; i > 0; --i) xh[i] = xh[i - 1];
        xh[0] = x[n];
        double acc = 0;
        for (int i = 0; i <= order; ++i) acc += b[i] * xh[i];
        for (int i = 1; i <= order; ++i) acc -= a[i] * yh[i];
        for (int i = order; i > 1; --i) yh[i] = yh[i - 1];
        yh[1] = acc;
        y[n] = static_cast<float>(acc);
    }
}

void loopIir(benchmark::State& state) {
    double b[5], a[5], xh[5] = {}, yh[5] = {};
    for (int i = 0; i < 5; ++i) {
        b[i] = kIirTaps[i];
        a[i] = kIirTaps[5 + i];
    }
    const auto x = noise(kIirLen, 5);
    std::vector<float> y(kIirLen);
    int order = 4;
    benchmark::DoNotOptimize(order);
    for (auto _ : state) {
        directForm(b, a, order, xh, yh, x.data(), y.data(), kIirLen);
        benchmark::ClobberMemory();
    }
}

// ---- Gaussian generator ----------------------------------------------------------

constexpr int kGaussLen = 64 * 1024;

void zorGauss(benchmark::State& state) {
    void* st = nullptr;
    zorsRandGaussInitAlloc_32f(&st, 0.0f, 1.0f, 1234);
    std::vector<float> y(kGaussLen);
    for (auto _ : state) {
        zorsRandGauss_32f(y.data(), kGaussLen, st);
        benchmark::ClobberMemory();
    }
    zorsRandGaussFree_32f(st);
}

void stdGauss(benchmark::State& state) {
    std::mt19937 g(1234);
    std::normal_distribution<float> d(0.0f, 1.0f);
    std::vector<float> y(kGaussLen);
    for (auto _ : state) {
        for (float& v : y) v = d(g);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(iir4, "zorsIIR_32f order 4, 64 Ki samples", zorIir, loopIir,
        "plain double direct form loop -O2", 1.0);
ZB_PAIR(randgauss, "zorsRandGauss_32f 64 Ki samples", zorGauss, stdGauss,
        "std::normal_distribution<float> + std::mt19937", 0.5);

// ---- autocorrelation -------------------------------------------------------------

namespace {

// The plain loop: every lag summed in double.
__attribute__((noinline)) void directAutoCorr(const float* x, int n, float* r, int lags) {
    for (int k = 0; k < lags; ++k) {
        double acc = 0;
        for (int i = 0; i + k < n; ++i) acc += double(x[i]) * double(x[i + k]);
        r[k] = static_cast<float>(acc);
    }
}

template <int Len, int Lags>
void zorAutoCorr(benchmark::State& state) {
    const auto x = noise(Len, 7);
    std::vector<float> r(Lags);
    for (auto _ : state) {
        zorsAutoCorr_32f(x.data(), Len, r.data(), Lags);
        benchmark::ClobberMemory();
    }
}

template <int Len, int Lags>
void loopAutoCorr(benchmark::State& state) {
    const auto x = noise(Len, 7);
    std::vector<float> r(Lags);
    for (auto _ : state) {
        directAutoCorr(x.data(), Len, r.data(), Lags);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(autocorr_short, "zorsAutoCorr_32f 400 samples, 13 lags", (zorAutoCorr<400, 13>),
        (loopAutoCorr<400, 13>), "plain double loop -O2", 0);
ZB_PAIR(autocorr_long, "zorsAutoCorr_32f 4096 samples, 4096 lags", (zorAutoCorr<4096, 4096>),
        (loopAutoCorr<4096, 4096>), "plain double loop -O2", 0);
