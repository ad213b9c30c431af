// Hamming and Hann windows, on every variant's entries.
#include <gtest/gtest.h>

#include <cfenv>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <random>
#include <vector>
#if !defined(_WIN32)
#  include <thread>
#endif

#include "frame/fpu.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Window : public zt::VariantTest {};

constexpr double kTwoPi = 6.283185307179586;

// The weights a window of n samples must use, rounded exactly as the
// rotation recurrence rounds them (each step a double multiply and add).
std::vector<double> recurrenceWeights(int n, bool hann) {
    double step;
    {
        zor::DoublePrecisionScope fpu;
        step = zor::toDouble(kTwoPi / double(n - 1));
    }
    const double c = zor::toDouble(std::cos(step));
    zor::DoublePrecisionScope fpu;
    const double s = zor::toDouble(std::sqrt(zor::toDouble(1.0 - zor::toDouble(c * c))));
    std::vector<double> w(n);
    double cs = 1.0, sn = 0.0;
    int k = 0;
    for (; k < (n - 1) / 2; ++k) {
        w[k] = w[n - 1 - k] = hann ? zor::toDouble(0.5 * zor::toDouble(1.0 - cs))
                                   : zor::toDouble(0.54 - zor::toDouble(0.46 * cs));
        const double a = zor::toDouble(zor::toDouble(cs * c) - zor::toDouble(sn * s));
        sn = zor::toDouble(zor::toDouble(sn * c) + zor::toDouble(cs * s));
        cs = a;
    }
    if (n % 2) w[k] = 1.0;  // untouched
    else w[k] = w[k + 1] = hann ? zor::toDouble(0.5 * (1.0 - cs)) : zor::toDouble(0.54 - zor::toDouble(0.46 * cs));
    return w;
}

double closedForm(int n, int k, bool hann) {
    const double cs = std::cos(kTwoPi * k / (n - 1));
    return hann ? 0.5 * (1 - cs) : 0.54 - 0.46 * cs;
}

float expect32f(float v, double w) {
    zor::DoublePrecisionScope fpu;
    return zor::toFloat(double(v) * w);
}
int16_t expect16s(int16_t v, double w) {
    zor::DoublePrecisionScope fpu;
    return int16_t(std::trunc(zor::toDouble(double(v) * w)));
}

template <class T>
bool sameBits(const T& a, const T& b) { return std::memcmp(&a, &b, sizeof(T)) == 0; }

const int kLengths[] = {3, 4, 5, 6, 7, 8, 16, 17, 100, 101, 1024, 1025};

}  // namespace

TEST_P(Window, ChecksComeFirstAndWriteNothing) {
    const zt::Api& z = this->z();
    zt::GuardedBuffer buf(64);
    std::memset(buf.data(), 0x5A, 64);
    std::vector<uint8_t> src(64, 1);
    auto* d = buf.data();
    const auto* s = src.data();
    struct Call { const char* name; std::function<Status(bool, int)> f; };
    const Call calls[] = {
        {"16s", [&](bool nul, int n) { return z.zorsWinHamming_16s((const int16_t*)s, nul ? nullptr : (int16_t*)d, n); }},
        {"16s src", [&](bool nul, int n) { return z.zorsWinHamming_16s(nul ? nullptr : (const int16_t*)s, (int16_t*)d, n); }},
        {"16s_I", [&](bool nul, int n) { return z.zorsWinHamming_16s_I(nul ? nullptr : (int16_t*)d, n); }},
        {"16sc", [&](bool nul, int n) { return z.zorsWinHamming_16sc((const Complex16s*)s, nul ? nullptr : (Complex16s*)d, n); }},
        {"16sc_I", [&](bool nul, int n) { return z.zorsWinHamming_16sc_I(nul ? nullptr : (Complex16s*)d, n); }},
        {"32f", [&](bool nul, int n) { return z.zorsWinHamming_32f(nul ? nullptr : (const float*)s, (float*)d, n); }},
        {"32f_I", [&](bool nul, int n) { return z.zorsWinHamming_32f_I(nul ? nullptr : (float*)d, n); }},
        {"32fc", [&](bool nul, int n) { return z.zorsWinHamming_32fc((const Complex32f*)s, nul ? nullptr : (Complex32f*)d, n); }},
        {"32fc_I", [&](bool nul, int n) { return z.zorsWinHamming_32fc_I(nul ? nullptr : (Complex32f*)d, n); }},
        {"64f", [&](bool nul, int n) { return z.zorsWinHamming_64f((const double*)s, nul ? nullptr : (double*)d, n); }},
        {"64f_I", [&](bool nul, int n) { return z.zorsWinHamming_64f_I(nul ? nullptr : (double*)d, n); }},
        {"64fc", [&](bool nul, int n) { return z.zorsWinHamming_64fc(nul ? nullptr : (const Complex64f*)s, (Complex64f*)d, n); }},
        {"64fc_I", [&](bool nul, int n) { return z.zorsWinHamming_64fc_I(nul ? nullptr : (Complex64f*)d, n); }},
        {"Hann", [&](bool nul, int n) { return z.zorsWinHann_32f_I(nul ? nullptr : (float*)d, n); }},
    };
    for (const Call& c : calls) {
        SCOPED_TRACE(c.name);
        EXPECT_EQ(c.f(true, 0), StatusNullPointer);
        EXPECT_EQ(c.f(true, 3), StatusNullPointer);
        for (int n : {2, 1, 0, -3}) EXPECT_EQ(c.f(false, n), StatusBadSize) << n;  // 1 or 2 samples refused
        for (int i = 0; i < 64; ++i) ASSERT_EQ(buf.data()[i], 0x5A);
    }
}

TEST_P(Window, DocumentedValues) {
    const zt::Api& z = this->z();
    float h[5] = {1, 1, 1, 1, 1}, n[5] = {1, 1, 1, 1, 1};
    ASSERT_EQ(z.zorsWinHamming_32f_I(h, 5), StatusOk);
    ASSERT_EQ(z.zorsWinHann_32f_I(n, 5), StatusOk);
    const float wantH[5] = {0.08f, 0.54f, 1.0f, 0.54f, 0.08f}, wantN[5] = {0.0f, 0.5f, 1.0f, 0.5f, 0.0f};
    for (int i = 0; i < 5; ++i) {
        EXPECT_NEAR(h[i], wantH[i], 1e-6);
        EXPECT_NEAR(n[i], wantN[i], 1e-6);
    }
    EXPECT_EQ(h[2], 1.0f);
    EXPECT_EQ(n[2], 1.0f);

    const int16_t pos[3] = {1000, 1000, 1000}, neg[3] = {-1000, -1000, -1000};
    int16_t out[3];
    ASSERT_EQ(z.zorsWinHamming_16s(pos, out, 3), StatusOk);
    EXPECT_EQ(out[0], 80);
    EXPECT_EQ(out[1], 1000);
    EXPECT_EQ(out[2], 80);
    ASSERT_EQ(z.zorsWinHamming_16s(neg, out, 3), StatusOk);  // toward zero, not down
    EXPECT_EQ(out[0], -80);
    EXPECT_EQ(out[1], -1000);
    EXPECT_EQ(out[2], -80);

    // Hann of three samples: the ends become 0, the middle keeps its value.
    float three[3] = {7.0f, -3.25f, 9.0f};
    ASSERT_EQ(z.zorsWinHann_32f_I(three, 3), StatusOk);
    EXPECT_EQ(three[0], 0.0f);
    EXPECT_EQ(three[1], -3.25f);
    EXPECT_EQ(three[2], 0.0f);
}

// Exact bits against the recurrence, close to the closed form, on guarded
// buffers, in place and out of place.
TEST_P(Window, FloatWindowsFollowTheRecurrence) {
    const zt::Api& z = this->z();
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> u(-100.0f, 100.0f);
    for (int n : kLengths) {
        SCOPED_TRACE(n);
        const std::vector<double> wH = recurrenceWeights(n, false), wN = recurrenceWeights(n, true);
        for (int k = 0; k < n; ++k) {
            ASSERT_NEAR(wH[k], closedForm(n, k, false), 1e-10);  // the recurrence drifts slowly
            ASSERT_NEAR(wN[k], closedForm(n, k, true), 1e-10);
        }
        zt::GuardedBuffer sb(n * sizeof(float), zt::Guard::Before), db(n * sizeof(float));
        float* s = sb.as<float>();
        float* d = db.as<float>();
        for (int k = 0; k < n; ++k) s[k] = u(rng);
        ASSERT_EQ(z.zorsWinHamming_32f(s, d, n), StatusOk);
        for (int k = 0; k < n; ++k) ASSERT_TRUE(sameBits(d[k], expect32f(s[k], wH[k]))) << k;
        std::vector<float> inplace(s, s + n);
        ASSERT_EQ(z.zorsWinHamming_32f_I(inplace.data(), n), StatusOk);
        ASSERT_EQ(std::memcmp(inplace.data(), d, n * sizeof(float)), 0);

        // Complex: both parts take the real member's weight.
        zt::GuardedBuffer cb(n * sizeof(Complex32f)), cd(n * sizeof(Complex32f), zt::Guard::Before);
        Complex32f* cs = cb.as<Complex32f>();
        Complex32f* cdst = cd.as<Complex32f>();
        for (int k = 0; k < n; ++k) cs[k] = {u(rng), u(rng)};
        ASSERT_EQ(z.zorsWinHamming_32fc(cs, cdst, n), StatusOk);
        for (int k = 0; k < n; ++k) {
            ASSERT_TRUE(sameBits(cdst[k].re, expect32f(cs[k].re, wH[k]))) << k;
            ASSERT_TRUE(sameBits(cdst[k].im, expect32f(cs[k].im, wH[k]))) << k;
        }
        ASSERT_EQ(z.zorsWinHamming_32fc_I(cs, n), StatusOk);
        ASSERT_EQ(std::memcmp(cs, cdst, n * sizeof(Complex32f)), 0);

        // Doubles: the product rounded once.
        zt::GuardedBuffer eb(n * sizeof(Complex64f)), ed(n * sizeof(Complex64f));
        Complex64f* es = eb.as<Complex64f>();
        Complex64f* edst = ed.as<Complex64f>();
        double* rs = eb.as<double>();
        double* rd = ed.as<double>();
        for (int k = 0; k < n; ++k) es[k] = {u(rng) * 1.0001, u(rng) * 0.9999};
        std::vector<double> real(rs, rs + n);
        ASSERT_EQ(z.zorsWinHamming_64f(real.data(), rd, n), StatusOk);
        for (int k = 0; k < n; ++k) {
            zor::DoublePrecisionScope fpu;
            ASSERT_TRUE(sameBits(rd[k], zor::toDouble(real[k] * wH[k]))) << k;
        }
        ASSERT_EQ(z.zorsWinHamming_64f_I(real.data(), n), StatusOk);
        ASSERT_EQ(std::memcmp(real.data(), rd, n * sizeof(double)), 0);
        ASSERT_EQ(z.zorsWinHamming_64fc(es, edst, n), StatusOk);
        for (int k = 0; k < n; ++k) {
            zor::DoublePrecisionScope fpu;
            ASSERT_TRUE(sameBits(edst[k].re, zor::toDouble(es[k].re * wH[k]))) << k;
            ASSERT_TRUE(sameBits(edst[k].im, zor::toDouble(es[k].im * wH[k]))) << k;
        }
        ASSERT_EQ(z.zorsWinHamming_64fc_I(es, n), StatusOk);
        ASSERT_EQ(std::memcmp(es, edst, n * sizeof(Complex64f)), 0);
    }
}

TEST_P(Window, HannFollowsTheRecurrence) {
    const zt::Api& z = this->z();
    std::mt19937 rng(6);
    std::uniform_real_distribution<float> u(-1e6f, 1e6f);
    for (int n : kLengths) {
        const std::vector<double> w = recurrenceWeights(n, true);
        std::vector<float> v(n), orig(n);
        for (int k = 0; k < n; ++k) orig[k] = v[k] = u(rng);
        ASSERT_EQ(z.zorsWinHann_32f_I(v.data(), n), StatusOk);
        for (int k = 0; k < n; ++k) ASSERT_TRUE(sameBits(v[k], expect32f(orig[k], w[k]))) << n << " " << k;
        EXPECT_EQ(v[0], 0.0f);
        EXPECT_EQ(v[n - 1], 0.0f);
    }
}

TEST_P(Window, SixteenBitTruncatesTowardZero) {
    const zt::Api& z = this->z();
    std::mt19937 rng(8);
    for (int n : kLengths) {
        const std::vector<double> w = recurrenceWeights(n, false);
        zt::GuardedBuffer sb(n * sizeof(int16_t)), db(n * sizeof(int16_t), zt::Guard::Before);
        int16_t* s = sb.as<int16_t>();
        int16_t* d = db.as<int16_t>();
        for (int k = 0; k < n; ++k) s[k] = int16_t(rng());
        s[0] = -32768;
        s[n - 1] = 32767;
        s[n / 2] = -32768;
        ASSERT_EQ(z.zorsWinHamming_16s(s, d, n), StatusOk);
        for (int k = 0; k < n; ++k) ASSERT_EQ(d[k], expect16s(s[k], w[k])) << n << " " << k;
        ASSERT_EQ(z.zorsWinHamming_16s_I(s, n), StatusOk);
        ASSERT_EQ(std::memcmp(s, d, n * sizeof(int16_t)), 0);

        zt::GuardedBuffer cb(n * sizeof(Complex16s)), cd(n * sizeof(Complex16s));
        Complex16s* cs = cb.as<Complex16s>();
        Complex16s* cdst = cd.as<Complex16s>();
        for (int k = 0; k < n; ++k) cs[k] = {int16_t(rng()), int16_t(rng())};
        ASSERT_EQ(z.zorsWinHamming_16sc(cs, cdst, n), StatusOk);
        for (int k = 0; k < n; ++k) {
            ASSERT_EQ(cdst[k].re, expect16s(cs[k].re, w[k]));
            ASSERT_EQ(cdst[k].im, expect16s(cs[k].im, w[k]));
        }
        ASSERT_EQ(z.zorsWinHamming_16sc_I(cs, n), StatusOk);
        ASSERT_EQ(std::memcmp(cs, cdst, n * sizeof(Complex16s)), 0);
    }
}

// Odd lengths leave the middle element's bits alone (a signalling NaN stays
// signalling); even lengths weight both middle elements alike.
TEST_P(Window, MiddleElements) {
    const zt::Api& z = this->z();
    uint32_t snan = 0x7f800001u;
    for (int n : {3, 9, 101}) {
        std::vector<float> v(n, 2.0f), d(n, 0.0f);
        std::memcpy(&v[n / 2], &snan, 4);
        ASSERT_EQ(z.zorsWinHamming_32f(v.data(), d.data(), n), StatusOk);
        EXPECT_TRUE(sameBits(d[n / 2], v[n / 2]));
        ASSERT_EQ(z.zorsWinHamming_32f_I(v.data(), n), StatusOk);
        uint32_t got;
        std::memcpy(&got, &v[n / 2], 4);
        EXPECT_EQ(got, snan);
    }
    for (int n : {4, 10, 1024}) {
        std::vector<double> v(n, 3.0);
        ASSERT_EQ(z.zorsWinHamming_64f_I(v.data(), n), StatusOk);
        EXPECT_EQ(v[n / 2 - 1], v[n / 2]);
        EXPECT_LT(v[n / 2], 3.0);
        for (int k = 0; k < n / 2; ++k) ASSERT_EQ(v[k], v[n - 1 - k]);
        for (int k = 1; k < n / 2; ++k) ASSERT_GT(v[k], v[k - 1]);
    }
}

// A window applied again must not reuse weights built for another length,
// another kind or another rounding mode: each call is checked against the
// recurrence run under the mode in force.
TEST_P(Window, RepeatedCallsFollowLengthKindAndRounding) {
    const zt::Api& z = this->z();
    struct Step { int n; bool hann; int mode; };
    const Step steps[] = {{1024, false, FE_TONEAREST}, {1024, false, FE_TONEAREST}, {1024, true, FE_TONEAREST},
                          {1024, false, FE_TONEAREST}, {1023, false, FE_TONEAREST}, {1024, false, FE_DOWNWARD},
                          {1024, false, FE_DOWNWARD},  {1024, false, FE_UPWARD},    {1024, false, FE_TONEAREST},
                          {5000, false, FE_TONEAREST}, {5000, false, FE_TONEAREST}, {1024, false, FE_TONEAREST}};
    std::mt19937 rng(21);
    std::uniform_real_distribution<float> u(-3.0f, 3.0f);
    std::vector<float> src(5000);
    for (float& x : src) x = u(rng);
    std::vector<float> nearest;
    for (const Step& st : steps) {
        SCOPED_TRACE(testing::Message() << st.n << (st.hann ? " Hann " : " Hamming ") << st.mode);
        std::vector<float> got(src.begin(), src.begin() + st.n), want(st.n);
        ASSERT_EQ(std::fesetround(st.mode), 0);
        const std::vector<double> w = recurrenceWeights(st.n, st.hann);
        for (int k = 0; k < st.n; ++k) want[k] = expect32f(src[k], w[k]);
        want[st.n / 2] = (st.n & 1) ? src[st.n / 2] : want[st.n / 2];
        const Status status = st.hann ? z.zorsWinHann_32f_I(got.data(), st.n) : z.zorsWinHamming_32f_I(got.data(), st.n);
        std::fesetround(FE_TONEAREST);
        ASSERT_EQ(status, StatusOk);
        for (int k = 0; k < st.n; ++k) ASSERT_TRUE(sameBits(got[k], want[k])) << k;
        if (st.n == 1024 && !st.hann) {
            if (st.mode == FE_TONEAREST) nearest = want;
            else EXPECT_NE(want, nearest);  // the modes really give other weights
        }
    }
}

#if !defined(_WIN32)
// Two threads applying different windows at once each get their own.
TEST_P(Window, ConcurrentCallsKeepTheirOwnWeights) {
    const zt::Api& z = this->z();
    auto worker = [&z](int n, bool* ok) {
        const std::vector<double> w = recurrenceWeights(n, false);
        std::vector<float> src(n), want(n), got(n);
        for (int k = 0; k < n; ++k) {
            src[k] = float(k % 7) - 3.0f;
            want[k] = (n & 1) && k == n / 2 ? src[k] : expect32f(src[k], w[k]);
        }
        for (int round = 0; round < 300 && *ok; ++round) {
            *ok = z.zorsWinHamming_32f(src.data(), got.data(), n) == StatusOk && got == want;
        }
    };
    bool okA = true, okB = true;
    std::thread a(worker, 1000, &okA), b(worker, 777, &okB);
    a.join();
    b.join();
    EXPECT_TRUE(okA);
    EXPECT_TRUE(okB);
}
#endif

// Every variant gives the generic entry's bits.
TEST_P(Window, AgreesWithGeneric) {
    const zt::Api& z = this->z();
    const zt::Api& g = zt::api(0);
    std::mt19937 rng(12);
    std::uniform_real_distribution<float> u(-5.0f, 5.0f);
    for (int round = 0; round < 20; ++round) {
        const int n = 3 + int(rng() % 500);
        std::vector<float> s(n + 1), a(n + 1), b(n + 1);
        for (auto& x : s) x = u(rng);
        ASSERT_EQ(z.zorsWinHamming_32f(s.data() + 1, a.data() + 1, n), StatusOk);
        ASSERT_EQ(g.zorsWinHamming_32f(s.data() + 1, b.data() + 1, n), StatusOk);
        ASSERT_EQ(a, b);
        std::vector<float> c = s, e = s;
        ASSERT_EQ(z.zorsWinHann_32f_I(c.data(), n), StatusOk);
        ASSERT_EQ(g.zorsWinHann_32f_I(e.data(), n), StatusOk);
        ASSERT_EQ(c, e);
    }
}

ZT_ALL_VARIANTS(Window);
