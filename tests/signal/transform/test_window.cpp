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

double closedForm(int n, int k, bool hann) {
    const double c = std::cos(6.283185307179586 * k / (n - 1));
    return hann ? 0.5 * (1 - c) : 0.54 - 0.46 * c;
}

// An element times its weight: the double product rounded once, 16-bit
// data truncated toward zero, both parts of complex data alike.
float weighed(float v, double w) { return zor::toFloat(double(v) * w); }
double weighed(double v, double w) { return zor::toDouble(v * w); }
int16_t weighed(int16_t v, double w) { return int16_t(std::trunc(zor::toDouble(v * w))); }
template <class C>
C weighed(C v, double w) { return {weighed(v.re, w), weighed(v.im, w)}; }

// One member out of place (output against a guard page) and in place, on
// random parts P (-32768 at the ends and the middle): every element weighed
// by w, an odd middle keeping its bits (a signalling NaN too).
template <class P, class T>
void expectMember(Status(ZOR_CALL* fn)(const T*, T*, int), Status(ZOR_CALL* fnI)(T*, int),
                  const std::vector<double>& w) {
    const int n = int(w.size()), parts = sizeof(T) / sizeof(P);
    std::vector<T> src(n), want(n);
    std::mt19937 rng(n);
    zt::fillRandom(reinterpret_cast<P*>(src.data()), n * parts, rng);
    reinterpret_cast<P*>(src.data())[0] = reinterpret_cast<P*>(src.data())[n / 2 * parts] = P(-32768);
    const uint32_t snan = 0x7f800001u;
    if (std::is_same_v<P, float> && n % 2) std::memcpy(&src[n / 2], &snan, 4);
    {
        zor::DoublePrecisionScope fpu;
        for (int k = 0; k < n; ++k) want[k] = weighed(src[k], w[k]);
    }
    if (n % 2) std::memcpy(&want[n / 2], &src[n / 2], sizeof(T));  // bits, not through the x87 unit
    zt::GuardedBuffer out(n * sizeof(T));
    ASSERT_EQ(fn(src.data(), out.as<T>(), n), StatusOk);
    ASSERT_EQ(fnI(src.data(), n), StatusOk);
    EXPECT_EQ(std::memcmp(out.data(), want.data(), n * sizeof(T)), 0) << sizeof(T);
    EXPECT_EQ(std::memcmp(src.data(), want.data(), n * sizeof(T)), 0) << sizeof(T);
}

}  // namespace

// Every member goes through one template: one with a source, one in place.
TEST_P(Window, ChecksComeFirstAndWriteNothing) {
    uint8_t s[64] = {1}, d[64] = {};
    zt::expectChecks(z().zorsWinHamming_64fc, {(const Complex64f*)s, (Complex64f*)d, 3}, {zt::watch(d, sizeof d)},
                     zt::eachNull(), zt::badLength<2>(), zt::bad(StatusBadSize, zt::arg<2>(2)),
                     zt::bad(StatusNullPointer, zt::arg<1>(nullptr), zt::arg<2>(2)));
    zt::expectChecks(z().zorsWinHann_32f_I, {(float*)d, 3}, {zt::watch(d, sizeof d)}, zt::eachNull(),
                     zt::badLength<1>(), zt::bad(StatusBadSize, zt::arg<1>(1)));
}

// The weights follow the closed form closely and symmetrically and rise to
// the middle; every member applies them.
TEST_P(Window, EveryMemberAppliesTheClosedFormWeights) {
    const zt::Api& z = this->z();
    for (int n : {3, 4, 17, 1025, 5000}) {
        SCOPED_TRACE(n);
        std::vector<double> w(n, 1.0);
        std::vector<float> hann(n, 1.0f);
        ASSERT_EQ(z.zorsWinHamming_64f_I(w.data(), n), StatusOk);
        ASSERT_EQ(z.zorsWinHann_32f_I(hann.data(), n), StatusOk);
        for (int k = 0; k < n; ++k) {
            ASSERT_NEAR(w[k], closedForm(n, k, false), 1e-10);
            ASSERT_NEAR(hann[k], closedForm(n, k, true), 1e-7);
            ASSERT_TRUE(w[k] == w[n - 1 - k] && (k == 0 || 2 * k >= n || w[k] > w[k - 1]));
        }
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
    std::vector<float> first;
    for (int mode : {FE_DOWNWARD, FE_TONEAREST, FE_UPWARD, FE_UPWARD, FE_TONEAREST}) {
        std::vector<float> got = src, want = src;
        ASSERT_EQ(std::fesetround(mode), 0);
        const Status s = z().zorsWinHamming_32f_I(got.data(), 1024), g = zt::api(0).zorsWinHamming_32f_I(want.data(), 1024);
        std::fesetround(FE_TONEAREST);
        ASSERT_TRUE(s == StatusOk && g == StatusOk && got == want) << mode;
        EXPECT_TRUE(first.empty() || mode != FE_TONEAREST || want != first);  // the modes give other weights
        if (first.empty()) first = want;
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
        const std::vector<float> src = zt::randomFloats(n, n);
        std::vector<float> want(n), got(n);
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
