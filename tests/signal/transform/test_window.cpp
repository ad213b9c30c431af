// Hamming and Hann windows, on every variant's entries.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <tuple>
#include <vector>
#if !defined(_WIN32)
#  include <thread>
#endif

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Window : public zt::VariantTest {};
using zt::Api;
using zt::Case;

double closedForm(int n, int k, bool hann) {
    const double c = std::cos(6.283185307179586 * k / (n - 1));
    return hann ? 0.5 * (1 - c) : 0.54 - 0.46 * c;
}

// The weights themselves: the double member applied to ones.
std::vector<double> weightsOf(const Api& z, int n) {
    std::vector<double> w(n, 1.0);
    EXPECT_EQ(z.zorsWinHamming_64f_I(w.data(), n), StatusOk);
    return w;
}

}  // namespace

TEST_P(Window, ChecksComeFirstAndWriteNothing) {
    const Api& z = this->z();
    uint8_t s[64] = {1}, d[64] = {};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)};
    // One or two samples are refused too.
    const auto checks = [&](auto fn, auto... a) {
        constexpr size_t L = sizeof...(a) - 1;
        zt::expectChecks(fn, std::make_tuple(a...), w, zt::eachNull(), zt::badLength<L>(),
                         zt::bad(StatusBadSize, zt::arg<L>(1)), zt::bad(StatusBadSize, zt::arg<L>(2)),
                         zt::bad(StatusNullPointer, zt::arg<L - 1>(nullptr), zt::arg<L>(2)));
    };
    // every member goes through one template: one with a source, one in place
    checks(z.zorsWinHamming_64fc, (const Complex64f*)s, (Complex64f*)d, 3);
    checks(z.zorsWinHann_32f_I, (float*)d, 3);
}

// The weights follow the closed form closely and symmetrically, rise to the
// middle (an odd middle keeps its bits, a signalling NaN included; two even
// middles share a weight); every member applies the same weight, float and
// double data as the double product rounded once, 16-bit data truncated
// toward zero, both parts of complex data alike, in place or not.
TEST_P(Window, EveryMemberAppliesTheSameWeights) {
    const Api& z = this->z();
    std::mt19937 rng(5);
    for (int n : {3, 4, 6, 17, 1025, 5000}) {
        SCOPED_TRACE(n);
        std::vector<float> hann(n, 1.0f);
        ASSERT_EQ(z.zorsWinHann_32f_I(hann.data(), n), StatusOk);
        const std::vector<double> w = weightsOf(z, n);  // Hamming kept from here on
        for (int k = 0; k < n; ++k) {
            ASSERT_NEAR(w[k], closedForm(n, k, false), 1e-10);
            ASSERT_NEAR(hann[k], closedForm(n, k, true), 1e-7);
            ASSERT_EQ(w[k], w[n - 1 - k]);
            ASSERT_TRUE(k == 0 || 2 * k >= n || w[k] > w[k - 1]);
        }
        zt::GuardedBuffer fdb(n * sizeof(float)), ddb(n * sizeof(double));  // outputs against the guard page
        float* fd = fdb.as<float>();
        double* dd = ddb.as<double>();
        std::vector<float> f(n);
        std::vector<double> d(n);
        std::vector<int16_t> s(n), sd(n);
        for (int k = 0; k < n; ++k) f[k] = float(int(rng() % 20001) - 10000) / 7.0f, d[k] = f[k] * 1.0001, s[k] = int16_t(rng());
        s[0] = s[n / 2] = -32768;
        const uint32_t snan = 0x7f800001u;
        if (n % 2) std::memcpy(&f[n / 2], &snan, 4);
        ASSERT_EQ(z.zorsWinHamming_32f(f.data(), fd, n), StatusOk);
        ASSERT_EQ(z.zorsWinHamming_64f(d.data(), dd, n), StatusOk);
        ASSERT_EQ(z.zorsWinHamming_16s(s.data(), sd.data(), n), StatusOk);
        zor::DoublePrecisionScope fpu;
        for (int k = 0; k < n; ++k) {
            if (n % 2 && k == n / 2) {
                ASSERT_EQ(std::memcmp(&fd[k], &snan, 4), 0);
                ASSERT_TRUE(dd[k] == d[k] && sd[k] == s[k]);
                continue;
            }
            ASSERT_EQ(fd[k], zor::toFloat(double(f[k]) * w[k])) << k;
            ASSERT_EQ(dd[k], zor::toDouble(d[k] * w[k])) << k;
            ASSERT_EQ(sd[k], int16_t(std::trunc(zor::toDouble(double(s[k]) * w[k])))) << k;
        }
        // In place, and complex: each part as the real member weighs it.
        std::vector<Complex32f> cf(n);
        std::vector<Complex64f> cd(n);
        std::vector<Complex16s> cs(n);
        for (int k = 0; k < n; ++k) cf[k] = {f[k], -f[k]}, cd[k] = {d[k], -d[k]}, cs[k] = {s[k], int16_t(-s[k] - 1)};
        ASSERT_EQ(z.zorsWinHamming_32f_I(f.data(), n), StatusOk);
        ASSERT_EQ(z.zorsWinHamming_32fc_I(cf.data(), n), StatusOk);
        ASSERT_EQ(z.zorsWinHamming_64fc_I(cd.data(), n), StatusOk);
        ASSERT_EQ(z.zorsWinHamming_16sc_I(cs.data(), n), StatusOk);
        ASSERT_EQ(std::memcmp(f.data(), fd, n * sizeof(float)), 0);
        for (int k = 0; k < n; ++k) {
            if (n % 2 && k == n / 2) continue;
            ASSERT_TRUE(cf[k].re == fd[k] && cf[k].im == -fd[k]) << k;
            ASSERT_TRUE(cd[k].re == dd[k] && cd[k].im == -dd[k]) << k;
            ASSERT_TRUE(cs[k].re == sd[k] && cs[k].im == int16_t(std::trunc(double(-s[k] - 1) * w[k]))) << k;
        }
    }
}

// The SSE2 variants keep the last window's weights: a call for another
// length, kind or rounding mode must rebuild them, and every call must give
// the bits of the generic entry (which keeps nothing) under the same mode.
TEST_P(Window, RepeatedCallsFollowLengthKindAndRounding) {
    const Api& z = this->z();
    struct Step { int n; bool hann; int mode; };
    const Step steps[] = {{1024, false, FE_TONEAREST}, {1024, false, FE_TONEAREST}, {1024, true, FE_TONEAREST},
                          {1024, false, FE_TONEAREST}, {1023, false, FE_TONEAREST}, {1024, false, FE_DOWNWARD},
                          {1024, false, FE_DOWNWARD},  {1024, false, FE_UPWARD},    {1024, false, FE_TONEAREST},
                          {5000, false, FE_TONEAREST}, {5000, false, FE_TONEAREST}, {1024, false, FE_TONEAREST}};
    const std::vector<float> src = zt::randomFloats(5000, 21, 3.0f);
    std::vector<float> nearest;
    for (const Step& st : steps) {
        SCOPED_TRACE(testing::Message() << st.n << (st.hann ? " Hann " : " Hamming ") << st.mode);
        std::vector<float> got(src.begin(), src.begin() + st.n), want = got;
        ASSERT_EQ(std::fesetround(st.mode), 0);
        const Status s = st.hann ? z.zorsWinHann_32f_I(got.data(), st.n) : z.zorsWinHamming_32f_I(got.data(), st.n);
        const Status g = st.hann ? zt::api(0).zorsWinHann_32f_I(want.data(), st.n)
                                 : zt::api(0).zorsWinHamming_32f_I(want.data(), st.n);
        std::fesetround(FE_TONEAREST);
        ASSERT_TRUE(s == StatusOk && g == StatusOk);
        ASSERT_EQ(got, want);
        if (st.n == 1024 && !st.hann) {
            if (st.mode == FE_TONEAREST) nearest = want;
            else EXPECT_NE(want, nearest);  // the modes really give other weights
        }
    }
}

#if !defined(_WIN32)
// Two threads applying different windows at once each get their own.
TEST_P(Window, ConcurrentCallsKeepTheirOwnWeights) {
    const Api& z = this->z();
    auto worker = [&z](int n, bool* ok) {
        const std::vector<float> src = zt::randomFloats(n, n);
        std::vector<float> want(n), got(n);
        *ok = zt::api(0).zorsWinHamming_32f(src.data(), want.data(), n) == StatusOk;
        for (int round = 0; round < 300 && *ok; ++round)
            *ok = z.zorsWinHamming_32f(src.data(), got.data(), n) == StatusOk && got == want;
    };
    bool okA = true, okB = true;
    std::thread a(worker, 1000, &okA), b(worker, 777, &okB);
    a.join();
    b.join();
    EXPECT_TRUE(okA && okB);
}
#endif

ZT_ALL_VARIANTS(Window);
