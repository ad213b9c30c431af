// FFT specs and transforms against a double-precision reference.
#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdlib>
#include <cstring>
#include <vector>

#include "frame/memory.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

using cd = std::complex<double>;

// Recursive radix-2 transform in double, exp(-2 pi i k n / N) forward;
// twiddles straight from cos/sin of the exact angle.
void refFft(std::vector<cd>& a, bool inverse) {
    const size_t n = a.size();
    if (n == 1) return;
    std::vector<cd> even(n / 2), odd(n / 2);
    for (size_t i = 0; i < n / 2; ++i) even[i] = a[2 * i], odd[i] = a[2 * i + 1];
    refFft(even, inverse);
    refFft(odd, inverse);
    for (size_t k = 0; k < n / 2; ++k) {
        const double ang = (inverse ? 2.0 : -2.0) * 3.141592653589793 * double(k) / double(n);
        const cd t = cd(std::cos(ang), std::sin(ang)) * odd[k];
        a[k] = even[k] + t;
        a[k + n / 2] = even[k] - t;
    }
}

// Relative RMS error of (re, im)[k * stride] against ref * scale.
double relRms(const std::vector<cd>& ref, const float* re, const float* im, double scale, int stride = 1) {
    double num = 0, den = 0;
    for (size_t k = 0; k < ref.size(); ++k) {
        num += std::norm(cd(re[k * stride], im[k * stride]) - ref[k] * scale);
        den += std::norm(ref[k] * scale);
    }
    return den == 0 ? std::sqrt(num) : std::sqrt(num / den);
}

struct Spec {
    const zt::Api& z;
    void* p = nullptr;
    bool real;
    Spec(const zt::Api& api, bool r, int order, int flag) : z(api), real(r) {
        EXPECT_EQ(real ? z.zorsFFTInitAlloc_R_32f(&p, order, flag, 0) : z.zorsFFTInitAlloc_C_32f(&p, order, flag, 0),
                  StatusOk);
    }
    ~Spec() {
        EXPECT_TRUE(!p || (real ? z.zorsFFTFree_R_32f(p) : z.zorsFFTFree_C_32f(p)) == StatusOk);
    }
};

class Fft : public zt::VariantTest {};

// Every order, each scaling flag in turn (8: none, 1: 1/N forward, 2: 1/N
// inverse, 4: 1/sqrt(N) both ways): complex forward and inverse and the real
// forward transform within float accuracy; the CCS layout's zero parts.
TEST_P(Fft, AccuracyEveryOrderAndScaling) {
    for (int order = 0; order <= 16; ++order) {
        const int n = 1 << order, flag = 8 >> (order % 4);
        const double rn = std::sqrt(double(n)), fwd = flag == 1 ? 1.0 / n : flag == 4 ? 1 / rn : 1,
                     inv = flag == 2 ? 1.0 / n : flag == 4 ? 1 / rn : 1, bound = 5e-7 * (order < 1 ? 1 : order);
        SCOPED_TRACE(testing::Message() << "order " << order << " flag " << flag);
        const auto re = zt::randomFloats(n, 10 + order, 1.0f), im = zt::randomFloats(n, 100 + order, 1.0f);
        std::vector<cd> f(n), b(n), r(n);
        for (int i = 0; i < n; ++i) f[i] = b[i] = cd(re[i], im[i]), r[i] = re[i];
        refFft(f, false);
        refFft(b, true);
        refFft(r, false);
        r.resize(n / 2 + 1);
        Spec c(z(), false, order, flag), s(z(), true, order, flag);
        zt::GuardedBuffer outRe(n * sizeof(float)), outIm(n * sizeof(float)), ccs((n + 2) * sizeof(float));
        float *dr = outRe.as<float>(), *di = outIm.as<float>(), *d = ccs.as<float>();
        std::memset(d, 0xFF, (n + 2) * sizeof(float));
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(re.data(), im.data(), dr, di, c.p, nullptr), StatusOk);
        EXPECT_LE(relRms(f, dr, di, fwd), bound);
        ASSERT_EQ(z().zorsFFTInv_CToC_32f(re.data(), im.data(), dr, di, c.p, nullptr), StatusOk);
        EXPECT_LE(relRms(b, dr, di, inv), bound);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(re.data(), d, s.p, nullptr), StatusOk);
        EXPECT_LE(relRms(r, d, d + 1, fwd, 2), bound);
        EXPECT_TRUE(d[1] == 0.0f && (n == 1 || d[n + 1] == 0.0f));  // one bin only for N = 1
    }
}

// In place, with a caller buffer of the documented generous size, at
// addresses off alignment: the same bits as out of place, and the inverse
// (scaled by 1/N) gives the input back.
TEST_P(Fft, InPlaceAndCallerBuffers) {
    for (int order : {2, 4, 7, 10, 11, 13}) {
        const int n = 1 << order;
        const auto re = zt::randomFloats(n, 21, 1.0f), im = zt::randomFloats(n, 22, 1.0f);
        Spec c(z(), false, order, 2), r(z(), true, order, 8);
        std::vector<float> er(n), ei(n), ccs(n + 2), pr(n + 1), pi(n + 1), ip(n + 3);
        std::vector<uint8_t> buf(64 * n + 4096 + 3);
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(re.data(), im.data(), er.data(), ei.data(), c.p, nullptr), 0);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(re.data(), ccs.data(), r.p, nullptr), 0);
        std::memcpy(pr.data() + 1, re.data(), n * 4);
        std::memcpy(pi.data() + 1, im.data(), n * 4);
        std::memcpy(ip.data() + 1, re.data(), n * 4);
        float *xr = pr.data() + 1, *xi = pi.data() + 1;
        ASSERT_EQ(z().zorsFFTFwd_CToC_32f(xr, xi, xr, xi, c.p, buf.data() + 1), 0);
        EXPECT_TRUE(std::memcmp(xr, er.data(), n * 4) == 0 && std::memcmp(xi, ei.data(), n * 4) == 0) << order;
        ASSERT_EQ(z().zorsFFTInv_CToC_32f(xr, xi, xr, xi, c.p, nullptr), 0);
        for (int i = 0; i < n; ++i) ASSERT_TRUE(std::fabs(xr[i] - re[i]) < 2e-6f && std::fabs(xi[i] - im[i]) < 2e-6f);
        ASSERT_EQ(z().zorsFFTFwd_RToCCS_32f(ip.data() + 1, ip.data() + 1, r.p, buf.data() + 3), 0);
        EXPECT_EQ(0, std::memcmp(ip.data() + 1, ccs.data(), (n + 2) * 4)) << order;
    }
}

// Every variant gives the generic entry's bits: the passes do the same
// float operations in the same order, whatever code carries them.  The
// 32-bit generic variant computes on the x87 unit, whose float sums are not
// rounded alike, so there the SSE variant is the reference.
TEST_P(Fft, AgreesWithGeneric) {
#if defined(__i386__)
    if (variant() == 0) GTEST_SKIP() << "x87 sums";
    const int reference = 1;
#else
    const int reference = 0;
#endif
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const int order = c.index() % 14, n = 1 << order;
        Spec s(z, false, order, 8 >> (order % 4)), r(z, true, order, 8);
        const float *xr = c.in<float>(n), *xi = c.in<float>(n);
        return z.zorsFFTFwd_CToC_32f(xr, xi, c.out<float>(n), c.out<float>(n), s.p, nullptr) +
               z.zorsFFTInv_CToC_32f(xr, xi, c.out<float>(n), c.out<float>(n), s.p, nullptr) +
               z.zorsFFTFwd_RToCCS_32f(xr, c.out<float>(n + 2), r.p, nullptr);
    }, reference);
}

TEST_P(Fft, ChecksAndIdentifiers) {
    const zt::Api& a = z();
    void* p = nullptr;
    const std::vector<zt::Watch> wp{zt::watch(&p, sizeof p)};
    zt::expectChecks(a.zorsFFTInitAlloc_C_32f, {&p, 4, 8, 0}, wp, zt::eachNull(), zt::bad(StatusBadOrder, zt::arg<1>(31)),
                     zt::bad(StatusBadOrder, zt::arg<1>(-1)), zt::bad(StatusBadFlag, zt::arg<2>(3)),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(31)),
                     zt::bad(StatusBadOrder, zt::arg<1>(31), zt::arg<2>(3)));
    EXPECT_EQ(a.zorsFFTFree_C_32f(p), StatusOk);
    p = nullptr;
    zt::expectChecks(a.zorsFFTInitAlloc_R_32f, {&p, 4, 8, 0}, wp, zt::eachNull(), zt::bad(StatusBadOrder, zt::arg<1>(-1)),
                     zt::bad(StatusBadFlag, zt::arg<2>(0)));
    EXPECT_EQ(a.zorsFFTFree_R_32f(p), StatusOk);
    // The spec first (null, then its kind), then the data pointers; a null
    // buffer is allowed.
    Spec c(a, false, 5, 8), r(a, true, 5, 8);
    float x[64] = {1}, y[64] = {};
    const std::vector<zt::Watch> wy{zt::watch(y, sizeof y)};
    for (auto fn : {a.zorsFFTFwd_CToC_32f, a.zorsFFTInv_CToC_32f})
        zt::expectChecks(fn, {x, x, y, y + 32, c.p, nullptr}, wy, zt::eachNull(StatusNullPointer, {5}),
                         zt::bad(StatusContextMismatch, zt::arg<4>(r.p)),
                         zt::bad(StatusContextMismatch, zt::arg<0>(nullptr), zt::arg<4>(r.p)));
    zt::expectChecks(a.zorsFFTFwd_RToCCS_32f, {x, y, r.p, nullptr}, wy, zt::eachNull(StatusNullPointer, {3}),
                     zt::bad(StatusContextMismatch, zt::arg<2>(c.p)),
                     zt::bad(StatusContextMismatch, zt::arg<0>(nullptr), zt::arg<2>(c.p)));
    EXPECT_EQ(a.zorsFFTFree_R_32f(c.p), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFree_C_32f(r.p), StatusContextMismatch);
    EXPECT_EQ(a.zorsFFTFree_C_32f(nullptr), StatusNullPointer);
    // The published record: identifiers 5 and 6, order, scaling, buffer size.
    EXPECT_TRUE(static_cast<const int32_t*>(c.p)[0] == 5 && static_cast<const int32_t*>(r.p)[0] == 6);
    struct Rec { int32_t id, order, fwd, inv; float scale; uint32_t hint; int32_t buf, alloc; } rec;
    for (int flag : {1, 2, 4, 8}) {
        void* q = nullptr;
        ASSERT_EQ(a.zorsFFTInitAlloc_C_32f(&q, 12, flag, 7), StatusOk);
        std::memcpy(&rec, q, sizeof rec);
        EXPECT_TRUE(rec.order == 12 && rec.fwd == (flag == 1 || flag == 4) && rec.inv == (flag == 2 || flag == 4));
        EXPECT_TRUE(flag == 8 || rec.scale == (flag == 4 ? 1.0f / 64 : 1.0f / 4096));
        EXPECT_TRUE(rec.hint == 7u && rec.buf > 0 && rec.buf <= 64 * 4096 + 4096 && rec.alloc == 1);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(q) % 32, 0u);
        EXPECT_EQ(a.zorsFFTFree_C_32f(q), StatusOk);
    }
    std::memcpy(&rec, r.p, sizeof rec);
    EXPECT_EQ(rec.buf, 0);
}

void* failingAlloc(size_t) { return nullptr; }

TEST_P(Fft, AllocationFailures) {
    void* p = nullptr;
    Spec s(z(), false, 11, 8);
    std::vector<float> x(2048, 1.0f), y(2048, 5.0f);
    zor::mem::rawAlloc = failingAlloc;
    const Status c = z().zorsFFTInitAlloc_C_32f(&p, 5, 8, 0), r = z().zorsFFTInitAlloc_R_32f(&p, 0, 8, 0);
    const Status f = z().zorsFFTFwd_CToC_32f(x.data(), x.data(), y.data(), y.data(), s.p, nullptr);
    zor::mem::rawAlloc = std::malloc;
    EXPECT_TRUE(c == StatusNoMemory && r == StatusNoMemory && f == StatusNoMemory);
    EXPECT_TRUE(p == nullptr && y[0] == 5.0f);  // nothing written
    // The largest orders cannot be represented here: no memory, nothing leaked.
    EXPECT_EQ(z().zorsFFTInitAlloc_C_32f(&p, 30, 8, 0), StatusNoMemory);
}

ZT_ALL_VARIANTS(Fft);

}  // namespace
