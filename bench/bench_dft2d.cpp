// Image DFT against cv::dft (real input, packed CCS output, one thread).
// Before the workloads run, a cross-check compares zor's packed spectra with
// cv::dft's (in double) on sizes of every kind and stops the program on a
// mismatch.
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include <cmath>
#include <cstdio>
#include <cstdlib>

#include "bench/pairs.h"
#include "zor.h"

namespace {

cv::Mat noiseImage(int w, int h) {
    cv::Mat m(h, w, CV_32F);
    cv::RNG rng(12345);
    rng.fill(m, cv::RNG::UNIFORM, -1.0, 1.0);
    return m;
}

// zor's forward transform (flag 8) of m, or an empty matrix on failure.
cv::Mat zorForward(const cv::Mat& m) {
    void* spec = nullptr;
    cv::Mat out(m.size(), CV_32F);
    if (zoriDFTInitAlloc_R_32f(&spec, {m.cols, m.rows}, 8, 0) != StatusOk) return {};
    const Status s = zoriDFTFwd_RToPack_32f_C1R(m.ptr<float>(), int(m.step), out.ptr<float>(), int(out.step),
                                                spec, nullptr);
    zoriDFTFree_R_32f(spec);
    return s == StatusOk ? out : cv::Mat();
}

// The cross-check: zor's packed spectrum against cv::dft's of the same
// image in double (same layout, relative RMS difference within float
// accuracy), and zor's inverse of that spectrum against w h times the image.
struct CrossCheck {
    CrossCheck() {
        const int sizes[][2] = {{1024, 1024}, {1000, 1000}, {1, 1}, {1, 9}, {8, 1}, {2, 3}, {5, 4},
                                {7, 7}, {64, 36}, {37, 41}, {97, 6}, {250, 121}};
        for (const auto& s : sizes) {
            const cv::Mat x = noiseImage(s[0], s[1]);
            cv::Mat xd, refd, ref, got, back(x.size(), CV_32F);
            x.convertTo(xd, CV_64F);
            cv::dft(xd, refd);
            refd.convertTo(ref, CV_32F);
            zorForward(x).convertTo(got, CV_64F);
            const double tol = 1e-7 * (1 + std::log2(double(s[0]) * s[1]));
            const double err = got.empty() ? 1.0 : cv::norm(got, refd) / cv::norm(refd);
            void* spec = nullptr;
            zoriDFTInitAlloc_R_32f(&spec, {s[0], s[1]}, 2, 0);
            zoriDFTInv_PackToR_32f_C1R(ref.ptr<float>(), int(ref.step), back.ptr<float>(), int(back.step), spec,
                                       nullptr);
            zoriDFTFree_R_32f(spec);
            const double errInv = cv::norm(back, x) / cv::norm(x);
            if (err > tol || errInv > tol) {
                std::fprintf(stderr, "zoriDFT vs cv::dft %dx%d: relative difference %.3g / inverse %.3g (bound %.3g)\n",
                             s[0], s[1], err, errInv, tol);
                std::exit(1);
            }
        }
        std::printf("zoriDFTFwd_RToPack_32f_C1R / zoriDFTInv_PackToR_32f_C1R agree with cv::dft (double) on %d sizes\n",
                    int(sizeof sizes / sizeof sizes[0]));
    }
};
const CrossCheck crossCheck;

// Forward (flag 8) or inverse (flag 2) transforms of a W x H image.
template <int W, int H, bool Inverse>
void zorDft(benchmark::State& state) {
    const cv::Mat x = noiseImage(W, H);
    cv::Mat out(x.size(), CV_32F);
    void* spec = nullptr;
    zoriDFTInitAlloc_R_32f(&spec, {W, H}, Inverse ? 2 : 8, 0);
    const auto run = Inverse ? zoriDFTInv_PackToR_32f_C1R : zoriDFTFwd_RToPack_32f_C1R;
    for (auto _ : state) {
        run(x.ptr<float>(), int(x.step), out.ptr<float>(), int(out.step), spec, nullptr);
        benchmark::ClobberMemory();
    }
    zoriDFTFree_R_32f(spec);
}

template <int W, int H, bool Inverse>
void cvDft(benchmark::State& state) {
    const cv::Mat x = noiseImage(W, H);
    cv::Mat out(x.size(), CV_32F);
    for (auto _ : state) {
        cv::dft(x, out, Inverse ? cv::DFT_INVERSE | cv::DFT_REAL_OUTPUT | cv::DFT_SCALE : 0);
        benchmark::ClobberMemory();
    }
}

}  // namespace

ZB_PAIR(dft2d_1024, "zoriDFTFwd_RToPack_32f_C1R 1024x1024", (zorDft<1024, 1024, false>),
        (cvDft<1024, 1024, false>), "cv::dft real -> CCS", 1.5);
ZB_PAIR(dft2d_1000, "zoriDFTFwd_RToPack_32f_C1R 1000x1000", (zorDft<1000, 1000, false>),
        (cvDft<1000, 1000, false>), "cv::dft real -> CCS", 1.5);
ZB_PAIR(dft2d_prime, "zoriDFTFwd_RToPack_32f_C1R 1009x241", (zorDft<1009, 241, false>),
        (cvDft<1009, 241, false>), "cv::dft real -> CCS", 0);
ZB_PAIR(dft2d_inv_1000, "zoriDFTInv_PackToR_32f_C1R 1000x1000", (zorDft<1000, 1000, true>),
        (cvDft<1000, 1000, true>), "cv::dft CCS -> real, scaled", 0);
