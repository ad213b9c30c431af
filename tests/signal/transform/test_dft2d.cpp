// Image DFT against the defining sums in double, in the documented packed
// layout; round trips, buffers, checks and agreement of the variants.
// (The cross-check with cv::dft itself runs in the bench program, which
// links OpenCV.)
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdlib>
#include <cstring>
#include <numeric>
#include <random>
#include <vector>

#include "frame/memory.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

using cd = std::complex<double>;

cd root(long long num, long long den) {  // exp(-2 pi i num / den)
    const double a = -6.283185307179586 * double(num % den) / double(den);
    return {std::cos(a), std::sin(a)};
}

// Y(u, v) = sum src(x, y) exp(-2 pi i (u y / h + v x / w)), row-major [u][v].
std::vector<cd> directDft(const std::vector<float>& src, int w, int h) {
    std::vector<cd> rows(size_t(w) * h), y(size_t(w) * h);
    for (int r = 0; r < h; ++r)
        for (int v = 0; v < w; ++v)
            for (int x = 0; x < w; ++x) rows[r * w + v] += double(src[r * w + x]) * root((long long)v * x, w);
    for (int u = 0; u < h; ++u)
        for (int v = 0; v < w; ++v)
            for (int r = 0; r < h; ++r) y[u * w + v] += rows[r * w + v] * root((long long)u * r, h);
    return y;
}

// The packed layout, written out from its description.
std::vector<double> pack(const std::vector<cd>& y, int w, int h) {
    std::vector<double> out(size_t(w) * h);
    auto realColumn = [&](int x, int v) {
        out[x] = y[v].real();
        for (int u = 1; 2 * u < h; ++u) {
            out[(2 * u - 1) * w + x] = y[u * w + v].real();
            out[2 * u * w + x] = y[u * w + v].imag();
        }
        if (h % 2 == 0) out[(h - 1) * w + x] = y[h / 2 * w + v].real();
    };
    realColumn(0, 0);
    if (w % 2 == 0) realColumn(w - 1, w / 2);
    for (int k = 1; 2 * k < w; ++k)
        for (int u = 0; u < h; ++u) {
            out[u * w + 2 * k - 1] = y[u * w + k].real();
            out[u * w + 2 * k] = y[u * w + k].imag();
        }
    return out;
}

std::vector<float> noise(size_t n, unsigned seed) { return zt::randomFloats(n, seed, 1.0f); }

// Relative RMS distance of an image (rows `step` bytes apart) from ref * f.
double relErr(const float* img, int step, const std::vector<double>& ref, int w, int h, double f) {
    double num = 0, den = 0;
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            const double r = ref[y * w + x] * f, d = reinterpret_cast<const float*>(
                                                         reinterpret_cast<const uint8_t*>(img) + y * step)[x] - r;
            num += d * d;
            den += r * r;
        }
    return std::sqrt(num / den);
}

double bound(int w, int h) { return 1e-7 * (1 + std::log2(double(w) * h)); }

struct Spec {
    const zt::Api& z;
    void* p = nullptr;
    Spec(const zt::Api& api, int w, int h, int flag) : z(api) {
        EXPECT_EQ(z.zoriDFTInitAlloc_R_32f(&p, {w, h}, flag, 0), StatusOk);
    }
    ~Spec() { EXPECT_EQ(z.zoriDFTFree_R_32f(p), StatusOk); }
};

class Dft2d : public zt::VariantTest {};

// Small odd, prime, composite and Bluestein (prime factors above 31) sizes,
// in both directions: the forward against the packed direct sums, the
// inverse of those sums against w h times the image.
TEST_P(Dft2d, MatchesDirectSumsInPackedLayout) {
    const int sizes[][2] = {{1, 1}, {1, 7}, {6, 1}, {2, 2}, {2, 3}, {3, 2}, {5, 5}, {8, 5}, {12, 10},
                            {9, 16}, {49, 15}, {37, 4}, {3, 41}, {74, 11}, {30, 64}};
    for (const auto& s : sizes) {
        const int w = s[0], h = s[1];
        const auto x = noise(size_t(w) * h, w * 100 + h);
        const std::vector<double> ref = pack(directDft(x, w, h), w, h);
        zt::GuardedImage<float> dst(w, h, 0, 12);
        Spec spec(z(), w, h, 8);
        ASSERT_EQ(z().zoriDFTFwd_RToPack_32f_C1R(x.data(), w * 4, dst.roi(), dst.step(), spec.p, nullptr), StatusOk);
        EXPECT_LE(relErr(dst.roi(), dst.step(), ref, w, h, 1.0), bound(w, h)) << w << "x" << h;
        EXPECT_TRUE(dst.outsideIntact());

        std::vector<float> in(ref.begin(), ref.end()), back(size_t(w) * h);
        ASSERT_EQ(z().zoriDFTInv_PackToR_32f_C1R(in.data(), w * 4, back.data(), w * 4, spec.p, nullptr), StatusOk);
        const std::vector<double> xd(x.begin(), x.end());
        EXPECT_LE(relErr(back.data(), w * 4, xd, w, h, double(w) * h), bound(w, h)) << w << "x" << h;
    }
}

// Scaling flags, forward then inverse, in place, on larger sizes.
TEST_P(Dft2d, RoundTripsWithEveryFlag) {
    struct F { int flag; double fwd, inv; };
    for (const auto& s : {std::pair<int, int>{64, 48}, {35, 33}, {101, 7}}) {
        const int w = s.first, h = s.second;
        const double n = double(w) * h;
        const auto x = noise(size_t(w) * h, 5);
        const std::vector<double> xd(x.begin(), x.end());
        for (F f : {F{8, 1, 1}, F{1, 1 / n, 1}, F{2, 1, 1 / n}, F{4, 1 / std::sqrt(n), 1 / std::sqrt(n)}}) {
            Spec spec(z(), w, h, f.flag);
            std::vector<float> img = x;
            ASSERT_EQ(z().zoriDFTFwd_RToPack_32f_C1R(img.data(), w * 4, img.data(), w * 4, spec.p, nullptr), 0);
            EXPECT_NEAR(img[0], std::accumulate(xd.begin(), xd.end(), 0.0) * f.fwd, 1e-4 * std::sqrt(n) * f.fwd);
            ASSERT_EQ(z().zoriDFTInv_PackToR_32f_C1R(img.data(), w * 4, img.data(), w * 4, spec.p, nullptr), 0);
            EXPECT_LE(relErr(img.data(), w * 4, xd, w, h, n * f.fwd * f.inv), 2 * bound(w, h)) << w << " " << f.flag;
        }
    }
}

// A caller's buffer (of the documented always-enough size, unaligned), the
// own allocation and the stack give the same bits; a failing allocation
// writes nothing.
void* failingAlloc(size_t) { return nullptr; }

TEST_P(Dft2d, BuffersAndAllocationFailure) {
    for (const auto& s : {std::pair<int, int>{3, 200}, {300, 2}, {16, 16}, {67, 5}, {1, 331}}) {
        const int w = s.first, h = s.second;
        const auto x = noise(size_t(w) * h, 9);
        Spec spec(z(), w, h, 4);
        std::vector<float> a(x.size()), b(x.size(), 7.0f);
        std::vector<uint8_t> buf(1024 * std::max(w, h) + 4096 + 1);
        ASSERT_EQ(z().zoriDFTFwd_RToPack_32f_C1R(x.data(), w * 4, a.data(), w * 4, spec.p, buf.data() + 1), 0);
        int32_t need;
        std::memcpy(&need, static_cast<uint8_t*>(spec.p) + 28, 4);
        EXPECT_LE(need, 1024 * std::max(w, h) + 4096);
        if (need > 0) {
            zor::mem::rawAlloc = failingAlloc;
            EXPECT_EQ(z().zoriDFTFwd_RToPack_32f_C1R(x.data(), w * 4, b.data(), w * 4, spec.p, nullptr), StatusNoMemory);
            zor::mem::rawAlloc = std::malloc;
            EXPECT_EQ(b[0], 7.0f);
        }
        ASSERT_EQ(z().zoriDFTFwd_RToPack_32f_C1R(x.data(), w * 4, b.data(), w * 4, spec.p, nullptr), 0);
        EXPECT_EQ(0, std::memcmp(a.data(), b.data(), a.size() * 4)) << w << "x" << h;
    }
}

TEST_P(Dft2d, Checks) {
    const auto& a = z();
    void* p = nullptr;
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(nullptr, {0, 4}, 3, 0), StatusNullPointer);
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(&p, {0, 4}, 3, 0), StatusBadSize);
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(&p, {4, -1}, 8, 0), StatusBadSize);
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(&p, {4, 4}, 3, 0), StatusBadFlag);
    EXPECT_EQ(p, nullptr);
    zor::mem::rawAlloc = failingAlloc;
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(&p, {4, 4}, 8, 0), StatusNoMemory);
    zor::mem::rawAlloc = std::malloc;
    EXPECT_EQ(a.zoriDFTInitAlloc_R_32f(&p, {0x7FFFFFFF, 3}, 8, 0), StatusNoMemory);  // no 32-bit sizes
    EXPECT_EQ(a.zoriDFTFree_R_32f(nullptr), StatusNullPointer);

    Spec spec(a, 6, 5, 2);
    int32_t rec[9];
    std::memcpy(rec, spec.p, sizeof rec);
    EXPECT_EQ(rec[0], 7);
    EXPECT_EQ(rec[1], 6);
    EXPECT_EQ(rec[2], 5);
    EXPECT_EQ(rec[3], 0);
    EXPECT_EQ(rec[4], 1);
    EXPECT_EQ(rec[8], 1);
    void* fft = nullptr;
    ASSERT_EQ(a.zorsFFTInitAlloc_R_32f(&fft, 3, 8, 0), StatusOk);
    EXPECT_EQ(a.zoriDFTFree_R_32f(fft), StatusContextMismatch);

    float src[5][8] = {}, dst[5][8] = {};
    for (auto fn : {a.zoriDFTFwd_RToPack_32f_C1R, a.zoriDFTInv_PackToR_32f_C1R})
        zt::expectChecks(fn, {&src[0][0], 32, &dst[0][0], 32, spec.p, nullptr}, {zt::watch(dst, sizeof dst)},
                         zt::eachNull(StatusNullPointer, {5}),
                         zt::bad(StatusContextMismatch, zt::arg<4>(fft), zt::arg<0>(nullptr)),
                         zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)),
                         zt::bad(StatusBadStep, zt::arg<1>(20)),
                         zt::bad(StatusBadStep, zt::arg<3>(0)),
                         zt::bad(StatusNotEvenStep, zt::arg<3>(30)));
    EXPECT_EQ(a.zorsFFTFree_R_32f(fft), StatusOk);
}

// Every variant gives the generic entry's bits, forward and inverse, on the
// harness's sizes and on larger ones of every kind of plan.
TEST_P(Dft2d, AgreesWithGenericBitForBit) {
    auto both = [](const zt::Api& z, zt::Case& c, ImageSize roi) {
        void* spec = nullptr;
        if (Status s = z.zoriDFTInitAlloc_R_32f(&spec, roi, 1 + c.index() % 2, 0)) return s;
        const auto src = c.inImage<float>(roi.width, roi.height);
        const auto fwd = c.outImage<float>(roi.width, roi.height), inv = c.outImage<float>(roi.width, roi.height);
        Status s = z.zoriDFTFwd_RToPack_32f_C1R(src.p, src.step, fwd.p, fwd.step, spec, nullptr);
        if (s == StatusOk) s = z.zoriDFTInv_PackToR_32f_C1R(src.p, src.step, inv.p, inv.step, spec, nullptr);
        z.zoriDFTFree_R_32f(spec);
        return s;
    };
    zt::agreesWithGeneric(variant(), [&](const zt::Api& z, zt::Case& c) { return both(z, c, c.roi()); });
    for (ImageSize roi : {ImageSize{64, 64}, ImageSize{250, 9}, ImageSize{14, 121}, ImageSize{67, 38}}) {
        zt::agreesWithGeneric(variant(), [&](const zt::Api& z, zt::Case& c) {
            return c.index() == 0 ? both(z, c, roi) : StatusOk;
        });
    }
}

ZT_ALL_VARIANTS(Dft2d);

}  // namespace
