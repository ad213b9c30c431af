// Vector arithmetic, elementwise math and statistics against OpenCV and the
// standard library, 64 Ki elements each.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <random>
#include <vector>

#include "bench/pairs.h"
#include "zor.h"

namespace {

constexpr int kLen = 64 * 1024;

std::vector<float> randomFloats(int n, uint32_t seed, float lo, float hi) {
    std::mt19937 rng(seed);
    std::uniform_real_distribution<float> u(lo, hi);
    std::vector<float> v(n);
    for (auto& x : v) x = u(rng);
    return v;
}
std::vector<int16_t> randomShorts(int n, uint32_t seed) {
    std::mt19937 rng(seed);
    std::uniform_int_distribution<int> u(-32768, 32767);
    std::vector<int16_t> v(n);
    for (auto& x : v) x = static_cast<int16_t>(u(rng));
    return v;
}

cv::Mat row(std::vector<float>& v) { return cv::Mat(1, static_cast<int>(v.size()), CV_32F, v.data()); }

// ---- add ----
void zorAdd(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1), b = randomFloats(kLen, 2, -1, 1);
    std::vector<float> d(kLen);
    for (auto _ : state) {
        zorsAdd_32f(a.data(), b.data(), d.data(), kLen);
        benchmark::DoNotOptimize(d.data());
    }
}
void cvAdd(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1), b = randomFloats(kLen, 2, -1, 1);
    std::vector<float> d(kLen);
    cv::Mat ma = row(a), mb = row(b), md = row(d);
    for (auto _ : state) {
        cv::add(ma, mb, md);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- multiply by a constant ----
void zorMulC(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1);
    std::vector<float> d(kLen);
    for (auto _ : state) {
        zorsMulC_32f(a.data(), 2.5f, d.data(), kLen);
        benchmark::DoNotOptimize(d.data());
    }
}
void cvMulC(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1);
    std::vector<float> d(kLen);
    cv::Mat ma = row(a), md = row(d);
    for (auto _ : state) {
        cv::multiply(ma, cv::Scalar::all(2.5), md);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- 16-bit multiply with scaling ----
void zorMulNR(benchmark::State& state) {
    auto a = randomShorts(kLen, 1), b = randomShorts(kLen, 2);
    std::vector<int16_t> d(kLen);
    for (auto _ : state) {
        zorsMul_NR_16s_Sfs(a.data(), b.data(), d.data(), kLen, 12);
        benchmark::DoNotOptimize(d.data());
    }
}
void cvMul16s(benchmark::State& state) {
    auto a = randomShorts(kLen, 1), b = randomShorts(kLen, 2);
    std::vector<int16_t> d(kLen);
    cv::Mat ma(1, kLen, CV_16S, a.data()), mb(1, kLen, CV_16S, b.data()), md(1, kLen, CV_16S, d.data());
    for (auto _ : state) {
        cv::multiply(ma, mb, md, 1.0 / 4096);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- dot product ----
void zorDot(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1), b = randomFloats(kLen, 2, -1, 1);
    float r;
    for (auto _ : state) {
        zorsDotProd_32f(a.data(), b.data(), kLen, &r);
        benchmark::DoNotOptimize(r);
    }
}
void cvDot(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1), b = randomFloats(kLen, 2, -1, 1);
    cv::Mat ma = row(a), mb = row(b);
    for (auto _ : state) {
        double r = ma.dot(mb);
        benchmark::DoNotOptimize(r);
    }
}

// ---- L2 norm of 16-bit samples (an exact integer sum of squares) ----
void zorNormL2_16s(benchmark::State& state) {
    const auto a = randomShorts(kLen, 3);
    float r = 0;
    for (auto _ : state) {
        zorsNorm_L2_16s32f(a.data(), kLen, &r);
        benchmark::DoNotOptimize(r);
    }
}
void cvNormL2_16s(benchmark::State& state) {
    auto a = randomShorts(kLen, 3);
    const cv::Mat m(1, kLen, CV_16S, a.data());
    for (auto _ : state) benchmark::DoNotOptimize(cv::norm(m, cv::NORM_L2));
}

// ---- exactness-matched peers ----
// Plain loops with zor's rule (double products and sums, one rounding at the
// end), compiled as ZB_WIDEST_CLONES.  Built with -fno-math-errno so that
// sqrt vectorizes.

// 32 double partial sums, so the compiler may keep four 512-bit registers.
ZB_WIDEST_CLONES double dotInDouble(const float* a, const float* b, int n) {
    double s[32] = {};
    int i = 0;
    for (; i + 32 <= n; i += 32)
        for (int j = 0; j < 32; ++j) s[j] += double(a[i + j]) * double(b[i + j]);
    double t = 0;
    for (double x : s) t += x;
    for (; i < n; ++i) t += double(a[i]) * double(b[i]);
    return t;
}

ZB_WIDEST_CLONES void magnitudeInDouble(const Complex32f* c, float* d, int n) {
    for (int i = 0; i < n; ++i) {
        const double re = c[i].re, im = c[i].im;
        d[i] = static_cast<float>(std::sqrt(re * re + im * im));
    }
}

void loopDot(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1), b = randomFloats(kLen, 2, -1, 1);
    for (auto _ : state) {
        float r = static_cast<float>(dotInDouble(a.data(), b.data(), kLen));
        benchmark::DoNotOptimize(r);
    }
}
void loopMagnitude(benchmark::State& state) {
    auto c = randomFloats(2 * kLen, 1, -100, 100);
    std::vector<float> d(kLen);
    for (auto _ : state) {
        magnitudeInDouble(reinterpret_cast<const Complex32f*>(c.data()), d.data(), kLen);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- magnitude of interleaved complex data ----
void zorMagnitude(benchmark::State& state) {
    auto c = randomFloats(2 * kLen, 1, -100, 100);
    std::vector<float> d(kLen);
    for (auto _ : state) {
        zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(c.data()), d.data(), kLen);
        benchmark::DoNotOptimize(d.data());
    }
}
void cvMagnitude(benchmark::State& state) {
    auto x = randomFloats(kLen, 1, -100, 100), y = randomFloats(kLen, 2, -100, 100);
    std::vector<float> d(kLen);
    cv::Mat mx = row(x), my = row(y), md = row(d);
    for (auto _ : state) {
        cv::magnitude(mx, my, md);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- phase ----
void zorPhase(benchmark::State& state) {
    auto x = randomFloats(kLen, 1, -100, 100), y = randomFloats(kLen, 2, -100, 100);
    std::vector<float> d(kLen);
    for (auto _ : state) {
        zorsPhase_32f(x.data(), y.data(), d.data(), kLen);
        benchmark::DoNotOptimize(d.data());
    }
}
void cvPhase(benchmark::State& state) {
    auto x = randomFloats(kLen, 1, -100, 100), y = randomFloats(kLen, 2, -100, 100);
    std::vector<float> d(kLen);
    cv::Mat mx = row(x), my = row(y), md = row(d);
    for (auto _ : state) {
        cv::phase(mx, my, md, false);
        benchmark::DoNotOptimize(d.data());
    }
}

// ---- natural logarithm (in place: both sides restore the input first) ----
void zorLn(benchmark::State& state) {
    const auto src = randomFloats(kLen, 1, 1e-3f, 1e3f);
    std::vector<float> w(kLen);
    for (auto _ : state) {
        std::memcpy(w.data(), src.data(), kLen * sizeof(float));
        zorsLn_32f_I(w.data(), kLen);
        benchmark::DoNotOptimize(w.data());
    }
}
void cvLn(benchmark::State& state) {
    auto src = randomFloats(kLen, 1, 1e-3f, 1e3f);
    std::vector<float> w(kLen);
    cv::Mat mw = row(w);
    for (auto _ : state) {
        std::memcpy(w.data(), src.data(), kLen * sizeof(float));
        cv::log(mw, mw);
        benchmark::DoNotOptimize(w.data());
    }
}

// The peer that gives the same results: each float's logarithm in double
// (correct to within an ulp) rounded once to float, as zor does.  The
// compiler cannot vectorise std::log on doubles without giving up exactness
// (fast-math), so the loop is plain.
void exactLn(benchmark::State& state) {
    const auto src = randomFloats(kLen, 1, 1e-3f, 1e3f);
    std::vector<float> w(kLen);
    for (auto _ : state) {
        std::memcpy(w.data(), src.data(), kLen * sizeof(float));
        for (float& x : w) x = static_cast<float>(std::log(static_cast<double>(x)));
        benchmark::DoNotOptimize(w.data());
    }
}

// ---- maximum with its index ----
void zorMaxIndx(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1);
    float m;
    int idx;
    for (auto _ : state) {
        zorsMaxIndx_32f(a.data(), kLen, &m, &idx);
        benchmark::DoNotOptimize(m);
        benchmark::DoNotOptimize(idx);
    }
}
void cvMaxIndx(benchmark::State& state) {
    auto a = randomFloats(kLen, 1, -1, 1);
    cv::Mat ma = row(a);
    for (auto _ : state) {
        double mn, mx;
        int imn[2], imx[2];
        cv::minMaxIdx(ma, &mn, &mx, imn, imx);
        benchmark::DoNotOptimize(mx);
        benchmark::DoNotOptimize(imx[1]);
    }
}

// ---- descending sort (both sides restore the input first) ----
void zorSort(benchmark::State& state) {
    const auto src = randomFloats(kLen, 1, -1e6f, 1e6f);
    std::vector<float> w(kLen);
    for (auto _ : state) {
        std::memcpy(w.data(), src.data(), kLen * sizeof(float));
        zorsSortDescend_32f_I(w.data(), kLen);
        benchmark::DoNotOptimize(w.data());
    }
}
void stdSort(benchmark::State& state) {
    const auto src = randomFloats(kLen, 1, -1e6f, 1e6f);
    std::vector<float> w(kLen);
    for (auto _ : state) {
        std::memcpy(w.data(), src.data(), kLen * sizeof(float));
        std::sort(w.begin(), w.end(), std::greater<float>());
        benchmark::DoNotOptimize(w.data());
    }
}

}  // namespace

ZB_PAIR(vadd, "zorsAdd_32f 64Ki", zorAdd, cvAdd, "cv::add", 1.2);
ZB_PAIR(vmulc, "zorsMulC_32f 64Ki", zorMulC, cvMulC, "cv::multiply by scalar", 1.2);
ZB_PAIR(vmulnr, "zorsMul_NR_16s_Sfs 64Ki sf=12", zorMulNR, cvMul16s, "cv::multiply 16s scale 1/4096", 1.0);
ZB_PAIR(vdot, "zorsDotProd_32f 64Ki", zorDot, cvDot, "cv::Mat::dot", 1.5);
ZB_PAIR(vmag, "zorsMagnitude_32fc 64Ki", zorMagnitude, cvMagnitude, "cv::magnitude", 1.5);
ZB_PAIR(vnorm16s, "zorsNorm_L2_16s32f 64Ki", zorNormL2_16s, cvNormL2_16s, "cv::norm L2 (CV_16S)", 0);
ZB_PAIR(vdotd, "zorsDotProd_32f 64Ki (same rule)", zorDot, loopDot, "double-accumulating loop", 0);
ZB_PAIR(vmagd, "zorsMagnitude_32fc 64Ki (same rule)", zorMagnitude, loopMagnitude, "double-precision loop", 0);
ZB_PAIR(vphase, "zorsPhase_32f 64Ki", zorPhase, cvPhase, "cv::phase", 2.0);
ZB_PAIR(vln, "zorsLn_32f_I 64Ki (+copy)", zorLn, cvLn, "cv::log (+copy)", 1.5);
ZB_PAIR(vlnexact, "zorsLn_32f_I 64Ki (+copy), same results", zorLn, exactLn, "float(std::log(double)) loop (+copy)", 0);
ZB_PAIR(vmaxidx, "zorsMaxIndx_32f 64Ki", zorMaxIndx, cvMaxIndx, "cv::minMaxIdx", 1.0);
ZB_PAIR(vsort, "zorsSortDescend_32f_I 64Ki (+copy)", zorSort, stdSort, "std::sort greater (+copy)", 1.0);
