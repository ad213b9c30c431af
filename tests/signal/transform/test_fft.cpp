// FFT specs and transforms against a double-precision reference.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdlib>
#include <cstring>
#include <random>
#include <vector>

#include "frame/memory.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

constexpr double kPi = 3.141592653589793;

using cd = std::complex<double>;

// Recursive radix-2 transform in double, exp(-2 pi i k n / N) for forward;
// twiddles straight from cos/sin of the exact angle.
void refFft(std::vector<cd>& a, bool inverse) {
    const size_t n = a.size();
    if (n == 1) return;
    std::vector<cd> even(n / 2), odd(n / 2);
    for (size_t i = 0; i < n / 2; ++i) {
        even[i] = a[2 * i];
        odd[i] = a[2 * i + 1];
    }
    refFft(even, inverse);
    refFft(odd, inverse);
    const double sign = inverse ? 1.0 : -1.0;
    for (size_t k = 0; k < n / 2; ++k) {
        const double ang = sign * 2.0 * kPi * static_cast<double>(k) / static_cast<double>(n);
        const cd t = cd(std::cos(ang), std::sin(ang)) * odd[k];
        a[k] = even[k] + t;
        a[k + n / 2] = even[k] - t;
    }
}

double relRms(const std::vector<cd>& ref, const float* re, const float* im, double scale) {
    double num = 0, den = 0;
    for (size_t k = 0; k < ref.size(); ++k) {
        const cd r = ref[k] * scale;
        num += std::norm(cd(re[k], im[k]) - r);
        den += std::norm(r);
    }
    return den == 0 ? std::sqrt(num) : std::sqrt(num / den);
}

double bound(int order) { return 5e-7 * (order < 1 ? 1 : order); }

std::vector<float> randomFloats(size_t n, unsigned seed) {
    std::mt19937 g(seed);
    std::uniform_real_distribution<float> d(-1.0f, 1.0f);
    std::vector<float> v(n);
    for (float& x : v) x = d(g);
    return v;
}

struct Spec {
    const zt::Api& z;
    void* p = nullptr;
    bool real;
    Spec(const zt::Api& api, bool r, int order, int flag) : z(api), real(r) {
        const Status s = real ? z.zorsFFTInitAlloc_R_32f(&p, order, flag, 0)
                              : z.zorsFFTInitAlloc_C_32f(&p, order, flag, 0);
        EXPECT_EQ(s, StatusOk);
    }
    ~Spec() {
        if (p) {
            EXPECT_EQ(real ? z.zorsFFTFree_R_32f(p) : z.zorsFFTFree_C_32f(p), StatusOk);
        }
    }
};

class Fft : public zt::VariantTest {};

TEST_P(Fft, ComplexAccuracyEveryOrder) {
    for (int order = 0; order <= 16; ++order) {
        const int n = 1 << order;
        const auto re = randomFloats(n, 10 + order), im = randomFloats(n, 100 + order);
        std::vector<cd> fwd(n), inv(n);
        for (int i = 0; i < n; ++i) fwd[i] = inv[i] = cd(re[i], im[i]);
        refFft(fwd, false);
        refFft(inv, true);
        Spec s(z(), false, order, 8);
        zt::GuardedBuffer outRe(n * sizeof(float)), outIm(n * sizeof(float));
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(re.data(), im.data(), outRe.as<float>(), outIm.as<float>(),
                                          s.p, nullptr), StatusOk);
        EXPECT_LE(relRms(fwd, outRe.as<float>(), outIm.as<float>(), 1.0), bound(order)) << order;
        ASSERT_EQ(z().zorsFFTInv_CToC_32f(re.data(), im.data(), outRe.as<float>(), outIm.as<float>(),
                                          s.p, nullptr), StatusOk);
        EXPECT_LE(relRms(inv, outRe.as<float>(), outIm.as<float>(), 1.0), bound(order)) << order;
    }
}

TEST_P(Fft, RealAccuracyAndCcsLayout) {
    for (int order = 0; order <= 16; ++order) {
        const int n = 1 << order;
        const auto x = randomFloats(n, 7 + order);
        std::vector<cd> ref(n);
        for (int i = 0; i < n; ++i) ref[i] = x[i];
        refFft(ref, false);
        Spec s(z(), true, order, 8);
        zt::GuardedBuffer out((n + 2) * sizeof(float));
        float* d = out.as<float>();
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(x.data(), d, s.p, nullptr), StatusOk);
        const int bins = n / 2 + 1;
        std::vector<float> re(bins), im(bins);
        for (int k = 0; k < bins; ++k) {
            re[k] = d[2 * k];
            im[k] = d[2 * k + 1];
        }
        std::vector<cd> half(ref.begin(), ref.begin() + bins);
        EXPECT_LE(relRms(half, re.data(), im.data(), 1.0), bound(order)) << order;
        EXPECT_EQ(d[1], 0.0f);
        EXPECT_EQ(d[n + 1], 0.0f);
    }
}

TEST_P(Fft, ScalingFlagsAndRoundTrip) {
    for (int order : {0, 1, 3, 4, 5, 9, 12}) {
        const int n = 1 << order;
        const auto re = randomFloats(n, 3), im = randomFloats(n, 4);
        std::vector<cd> ref(n);
        for (int i = 0; i < n; ++i) ref[i] = cd(re[i], im[i]);
        refFft(ref, false);
        const double rn = std::sqrt(static_cast<double>(n));
        struct F { int flag; double fwd, inv; };
        for (F f : {F{8, 1, 1}, F{1, 1.0 / n, 1}, F{2, 1, 1.0 / n}, F{4, 1 / rn, 1 / rn}}) {
            Spec s(z(), false, order, f.flag);
            std::vector<float> fr(n), fi(n), br(n), bi(n);
            ASSERT_EQ(z().zorsFFTFwd_CToC_32f(re.data(), im.data(), fr.data(), fi.data(), s.p, nullptr), 0);
            EXPECT_LE(relRms(ref, fr.data(), fi.data(), f.fwd), bound(order)) << order << " " << f.flag;
            ASSERT_EQ(z().zorsFFTInv_CToC_32f(fr.data(), fi.data(), br.data(), bi.data(), s.p, nullptr), 0);
            std::vector<cd> x(n);
            for (int i = 0; i < n; ++i) x[i] = cd(re[i], im[i]);
            // forward then inverse: N times the input, scaled by both factors
            EXPECT_LE(relRms(x, br.data(), bi.data(), f.fwd * f.inv * n), 2 * bound(order))
                << order << " " << f.flag;

            Spec r(z(), true, order, f.flag);
            std::vector<float> ccs(n + 2);
            ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(re.data(), ccs.data(), r.p, nullptr), 0);
            std::vector<cd> rr(n);
            for (int i = 0; i < n; ++i) rr[i] = re[i];
            refFft(rr, false);
            EXPECT_NEAR(ccs[0], rr[0].real() * f.fwd, 1e-5 * std::sqrt(n)) << order << " " << f.flag;
        }
    }
}

TEST_P(Fft, OrderZeroAndConstantInput) {
    Spec c(z(), false, 0, 1), r(z(), true, 0, 4);
    float re = 2.5f, im = -1.0f, ore = 0, oim = 0;
    EXPECT_EQ(z().zorsFFTFwd_CToC_32f(&re, &im, &ore, &oim, c.p, nullptr), StatusOk);
    EXPECT_EQ(ore, 2.5f);
    EXPECT_EQ(oim, -1.0f);
    float out[2] = {9, 9};
    EXPECT_EQ(z().zorsFFTFwd_RToCCS_32f(&re, out, r.p, nullptr), StatusOk);
    EXPECT_EQ(out[0], 2.5f);
    EXPECT_EQ(out[1], 0.0f);

    for (int order : {3, 6}) {
        const int n = 1 << order;
        Spec s(z(), true, order, 8);
        std::vector<float> x(n, 0.75f), d(n + 2, 9.0f);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(x.data(), d.data(), s.p, nullptr), StatusOk);
        EXPECT_FLOAT_EQ(d[0], 0.75f * n);
        for (int k = 1; k < n + 2; ++k) EXPECT_NEAR(d[k], 0.0f, 1e-5f) << k;
    }
}

TEST_P(Fft, InPlaceBuffersAndUnalignedPointers) {
    for (int order : {2, 4, 7, 10, 11, 13}) {
        const int n = 1 << order;
        const auto re = randomFloats(n, 21), im = randomFloats(n, 22);
        Spec c(z(), false, order, 2);
        std::vector<float> er(n), ei(n);
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(re.data(), im.data(), er.data(), ei.data(), c.p, nullptr), 0);
        // in place, with a caller buffer of the documented generous size, unaligned by 4 bytes
        std::vector<float> pr(n + 1), pi(n + 1);
        std::memcpy(pr.data() + 1, re.data(), n * 4);
        std::memcpy(pi.data() + 1, im.data(), n * 4);
        std::vector<uint8_t> buf(64 * n + 4096 + 1);
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(pr.data() + 1, pi.data() + 1, pr.data() + 1, pi.data() + 1,
                                          c.p, buf.data() + 1), 0);
        EXPECT_EQ(0, std::memcmp(pr.data() + 1, er.data(), n * 4)) << order;
        EXPECT_EQ(0, std::memcmp(pi.data() + 1, ei.data(), n * 4)) << order;
        // in place inverse (scaled by 1/N): back to the input
        ASSERT_EQ(z().zorsFFTInv_CToC_32f(pr.data() + 1, pi.data() + 1, pr.data() + 1, pi.data() + 1,
                                          c.p, nullptr), 0);
        for (int i = 0; i < n; ++i) {
            EXPECT_NEAR(pr[i + 1], re[i], 2e-6f);
            EXPECT_NEAR(pi[i + 1], im[i], 2e-6f);
        }

        Spec r(z(), true, order, 8);
        std::vector<float> ccs(n + 2), ip(n + 3);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(re.data(), ccs.data(), r.p, nullptr), 0);
        std::memcpy(ip.data() + 1, re.data(), n * 4);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(ip.data() + 1, ip.data() + 1, r.p, buf.data() + 3), 0);
        EXPECT_EQ(0, std::memcmp(ip.data() + 1, ccs.data(), (n + 2) * 4)) << order;
    }
}

// Every variant gives the generic entry's bits: the passes do the same
// float operations in the same order, whatever code carries them.  The
// 32-bit generic variant computes on the x87 unit, whose float sums are not
// rounded alike, so there the SSE variant is the reference.
TEST_P(Fft, AgreesWithGenericBitForBit) {
#if defined(__i386__)
    if (GetParam() == 0) GTEST_SKIP() << "x87 sums";
    const zt::Api& g = zt::api(1);
#else
    const zt::Api& g = zt::api(0);
#endif
    for (int order = 4; order <= 13; ++order) {
        const size_t n = size_t(1) << order;
        const std::vector<float> xr = randomFloats(n, 40 + order), xi = randomFloats(n, 80 + order);
        Spec mine(z(), false, order, 8), ref(g, false, order, 8);
        std::vector<float> ar(n), ai(n), br(n), bi(n);
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(xr.data(), xi.data(), ar.data(), ai.data(), mine.p, nullptr), StatusOk);
        ASSERT_EQ(g.zorsFFTFwd_CToC_32f(xr.data(), xi.data(), br.data(), bi.data(), ref.p, nullptr), StatusOk);
        EXPECT_EQ(0, std::memcmp(ar.data(), br.data(), n * 4)) << order;
        EXPECT_EQ(0, std::memcmp(ai.data(), bi.data(), n * 4)) << order;
        Spec mineR(z(), true, order, 8), refR(g, true, order, 8);
        std::vector<float> ca(n + 2), cb(n + 2);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(xr.data(), ca.data(), mineR.p, nullptr), StatusOk);
        ASSERT_EQ(g.zorsFFTFwd_RToCCS_32f(xr.data(), cb.data(), refR.p, nullptr), StatusOk);
        EXPECT_EQ(0, std::memcmp(ca.data(), cb.data(), (n + 2) * 4)) << order;
    }
}

TEST_P(Fft, ChecksAndIdentifiers) {
    void* p = nullptr;
    const auto& a = z();
    EXPECT_EQ(a.zorsFFTInitAlloc_C_32f(nullptr, 31, 3, 0), StatusNullPointer);
    EXPECT_EQ(a.zorsFFTInitAlloc_C_32f(&p, 31, 3, 0), StatusBadOrder);
    EXPECT_EQ(a.zorsFFTInitAlloc_R_32f(&p, -1, 8, 0), StatusBadOrder);
    EXPECT_EQ(a.zorsFFTInitAlloc_C_32f(&p, 4, 3, 0), StatusBadFlag);
    EXPECT_EQ(a.zorsFFTInitAlloc_R_32f(&p, 4, 0, 0), StatusBadFlag);
    EXPECT_EQ(p, nullptr);

    Spec c(a, false, 5, 8), r(a, true, 5, 8);
    const int32_t* cw = static_cast<const int32_t*>(c.p);
    const int32_t* rw = static_cast<const int32_t*>(r.p);
    EXPECT_EQ(cw[0], 5);
    EXPECT_EQ(rw[0], 6);
    EXPECT_EQ(cw[1], 5);  // order
    float x[64] = {}, y[64] = {};
    EXPECT_EQ(a.zorsFFTFwd_CToC_32f(x, x, y, y, r.p, nullptr), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTInv_CToC_32f(x, x, y, y, r.p, nullptr), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFwd_RToCCS_32f(x, y, c.p, nullptr), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFwd_CToC_32f(x, x, y, y, nullptr, nullptr), StatusNullPointer);
    // spec identifier before data pointers, null spec first of all
    EXPECT_EQ(a.zorsFFTFwd_CToC_32f(nullptr, x, y, y, r.p, nullptr), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFwd_CToC_32f(x, x, y, nullptr, c.p, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsFFTFwd_RToCCS_32f(x, nullptr, r.p, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsFFTFwd_RToCCS_32f(nullptr, y, nullptr, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsFFTFree_R_32f(c.p), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFree_C_32f(r.p), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFree_C_32f(nullptr), StatusNullPointer);

    // the published record fields
    struct Rec { int32_t id, order, fwd, inv; float scale; uint32_t hint; int32_t buf, alloc; };
    for (int flag : {1, 2, 4, 8}) {
        void* q = nullptr;
        ASSERT_EQ(a.zorsFFTInitAlloc_C_32f(&q, 12, flag, 7), StatusOk);
        Rec rec;
        std::memcpy(&rec, q, sizeof rec);
        EXPECT_EQ(rec.fwd, flag == 1 || flag == 4);
        EXPECT_EQ(rec.inv, flag == 2 || flag == 4);
        if (flag == 4) {
            EXPECT_FLOAT_EQ(rec.scale, 1.0f / 64);
        } else if (flag != 8) {
            EXPECT_FLOAT_EQ(rec.scale, 1.0f / 4096);
        }
        EXPECT_EQ(rec.hint, 7u);
        EXPECT_GT(rec.buf, 0);
        EXPECT_LE(rec.buf, 64 * 4096 + 4096);
        EXPECT_EQ(rec.alloc, 1);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(q) % 32, 0u);
        EXPECT_EQ(a.zorsFFTFree_C_32f(q), StatusOk);
    }
    void* q = nullptr;
    ASSERT_EQ(a.zorsFFTInitAlloc_R_32f(&q, 10, 8, 0), StatusOk);
    Rec rec;
    std::memcpy(&rec, q, sizeof rec);
    EXPECT_EQ(rec.buf, 0);
    EXPECT_EQ(a.zorsFFTFree_R_32f(q), StatusOk);
}

// A runtime allocator that fails.
void* failingAlloc(size_t) { return nullptr; }
struct FailAlloc {
    FailAlloc() { zor::mem::rawAlloc = failingAlloc; }
    ~FailAlloc() { zor::mem::rawAlloc = std::malloc; }
};

TEST_P(Fft, AllocationFailures) {
    void* p = nullptr;
    {
        FailAlloc fail;
        EXPECT_EQ(z().zorsFFTInitAlloc_C_32f(&p, 5, 8, 0), StatusNoMemory);
        EXPECT_EQ(z().zorsFFTInitAlloc_R_32f(&p, 0, 8, 0), StatusNoMemory);
    }
    EXPECT_EQ(p, nullptr);
    Spec s(z(), false, 11, 8);
    std::vector<float> x(2048, 1.0f), y(2048, 5.0f);
    {
        FailAlloc fail;
        EXPECT_EQ(z().zorsFFTFwd_CToC_32f(x.data(), x.data(), y.data(), y.data(), s.p, nullptr),
                  StatusNoMemory);
    }
    EXPECT_EQ(y[0], 5.0f);  // nothing written
    // The largest orders cannot be represented here: no memory, nothing leaked.
    EXPECT_EQ(z().zorsFFTInitAlloc_C_32f(&p, 30, 8, 0), StatusNoMemory);
}

ZT_ALL_VARIANTS(Fft);

}  // namespace
