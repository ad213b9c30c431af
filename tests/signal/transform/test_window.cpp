// Hamming and Hann windows, on every variant's entries.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstring>
#if !defined(_WIN32)
#  include <thread>
#endif

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Window : public zt::VariantTest {};

// An element times its weight: the double product rounded once, 16-bit
// data truncated toward zero, both parts of complex data alike.
float weighed(float v, double w) { return zor::toFloat(double(v) * w); }
double weighed(double v, double w) { return zor::toDouble(v * w); }
int16_t weighed(int16_t v, double w) { return int16_t(std::trunc(zor::toDouble(v * w))); }
template <class C>
C weighed(C v, double w) { return {weighed(v.re, w), weighed(v.im, w)}; }

// One member out of place (output against a guard page) and in place, on
// random parts P (-32768 at the ends and the middle): every element weighed
// by w, an odd middle keeping its bits (a signalling NaN too: not through
// the x87 unit).
template <class P, class T>
void expectMember(Status(ZOR_CALL* fn)(const T*, T*, int), Status(ZOR_CALL* fnI)(T*, int), const std::vector<double>& w) {
    const int n = int(w.size()), parts = sizeof(T) / sizeof(P);
    std::vector<T> src(n);
    P* p = reinterpret_cast<P*>(src.data());
    std::mt19937 rng(n);
    zt::fillRandom(p, n * parts, rng);
    p[0] = p[n / 2 * parts] = P(-32768);
    const uint32_t snan = 0x7f800001u;
    if (std::is_same_v<P, float> && n % 2) std::memcpy(p + n / 2 * parts, &snan, 4);
    std::vector<T> inPlace = src, want = src;  // copies of the bits
    zt::GuardedBuffer out(n * sizeof(T));
    ASSERT_TRUE(fn(src.data(), out.as<T>(), n) == StatusOk && fnI(inPlace.data(), n) == StatusOk);
    zor::DoublePrecisionScope fpu;
    for (int k = 0; k < n; ++k) if (n % 2 == 0 || 2 * k != n - 1) want[k] = weighed(src[k], w[k]);
    EXPECT_EQ(std::memcmp(out.data(), want.data(), n * sizeof(T)), 0) << sizeof(T);
    EXPECT_EQ(std::memcmp(inPlace.data(), want.data(), n * sizeof(T)), 0) << sizeof(T);
}

}  // namespace

// Every member goes through one template: one with a source and a
// destination stands for all; a length of 2 is the largest refused.
TEST_P(Window, ChecksComeFirstAndWriteNothing) {
    uint8_t s[64] = {1}, d[64] = {};
    zt::expectChecks(z().zorsWinHamming_64fc, {(const Complex64f*)s, (Complex64f*)d, 3}, {zt::watch(d, sizeof d)},
                     zt::eachNull(), zt::bad(StatusBadSize, zt::arg<2>(2)),
                     zt::bad(StatusNullPointer, zt::arg<1>(nullptr), zt::arg<2>(2)));
}

// The weights follow the closed form a - (1 - a) cos(2 pi k / (n - 1))
// closely; every member applies them.
TEST_P(Window, EveryMemberAppliesTheClosedFormWeights) {
    const zt::Api& z = this->z();
    for (int n : {3, 4, 17, 1025, 5000}) {
        SCOPED_TRACE(n);
        std::vector<double> w(n, 1.0);
        std::vector<float> hann(n, 1.0f);
        ASSERT_TRUE(z.zorsWinHamming_64f_I(w.data(), n) == StatusOk && z.zorsWinHann_32f_I(hann.data(), n) == StatusOk);
        const auto closedForm = [n](int k, double a) { return a - (1 - a) * std::cos(6.283185307179586 * k / (n - 1)); };
        for (int k = 0; k < n; ++k)
            ASSERT_TRUE(std::fabs(w[k] - closedForm(k, 0.54)) < 1e-10 && std::fabs(hann[k] - closedForm(k, 0.5)) < 1e-7) << k;
        expectMember<int16_t>(z.zorsWinHamming_16s, z.zorsWinHamming_16s_I, w);
        expectMember<int16_t>(z.zorsWinHamming_16sc, z.zorsWinHamming_16sc_I, w);
        expectMember<float>(z.zorsWinHamming_32f, z.zorsWinHamming_32f_I, w);
        expectMember<float>(z.zorsWinHamming_32fc, z.zorsWinHamming_32fc_I, w);
        expectMember<double>(z.zorsWinHamming_64f, z.zorsWinHamming_64f_I, w);
        expectMember<double>(z.zorsWinHamming_64fc, z.zorsWinHamming_64fc_I, w);
    }
}

// The SSE2 variants keep the last window's weights (the test above changes
// kind and length under them); a change of rounding mode must rebuild them
// too: every call gives the bits of the generic entry, which keeps nothing.
TEST_P(Window, KeptWeightsFollowTheRoundingMode) {
    const std::vector<float> src = zt::randomFloats(1024, 21, 3.0f);
    for (int mode : {FE_DOWNWARD, FE_TONEAREST, FE_UPWARD, FE_UPWARD, FE_TONEAREST}) {
        std::vector<float> got = src, want = src;
        ASSERT_EQ(std::fesetround(mode), 0);
        const Status s = z().zorsWinHamming_32f_I(got.data(), 1024), g = zt::api(0).zorsWinHamming_32f_I(want.data(), 1024);
        std::fesetround(FE_TONEAREST);
        ASSERT_TRUE(s == StatusOk && g == StatusOk && got == want) << mode;
    }
}

// Twice each (building the kept weights, then applying them), on specials
// and shifted buffers against guard pages.
TEST_P(Window, AgreesWithGeneric) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const int n = c.len();
        const float* f = c.in(c.floats(2 * n));
        const auto twice = [](auto fn, auto... args) { return fn(args...) + fn(args...); };
        return twice(z.zorsWinHamming_32f, f, c.out<float>(n), n) + twice(z.zorsWinHann_32f_I, c.inOut(c.floats(n)), n) +
               twice(z.zorsWinHamming_32fc, reinterpret_cast<const Complex32f*>(f), c.out<Complex32f>(n), n) +
               twice(z.zorsWinHamming_64f, c.in<double>(n), c.out<double>(n), n);
    });
}

#if !defined(_WIN32)
// Two threads applying different windows at once each get their own.
TEST_P(Window, ConcurrentCallsKeepTheirOwnWeights) {
    bool ok[2] = {true, true};
    auto worker = [this, &ok](int n, int t) {
        std::vector<float> src = zt::randomFloats(n, n), want(n), got(n);
        zt::api(0).zorsWinHamming_32f(src.data(), want.data(), n);
        for (int round = 0; round < 300 && ok[t]; ++round)
            ok[t] = z().zorsWinHamming_32f(src.data(), got.data(), n) == StatusOk && got == want;
    };
    std::thread a(worker, 1000, 0), b(worker, 777, 1);
    a.join(), b.join();
    EXPECT_TRUE(ok[0] && ok[1]);
}
#endif

ZT_ALL_VARIANTS(Window);
