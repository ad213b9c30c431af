// Mel filter bank: construction against the documented steps, evaluation,
// the bank's own transform, checks and codes.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/support/variants.h"

namespace {

constexpr double kPi = 3.141592653589793;

class MelFBank : public zt::VariantTest {};

// The published head of the bank record.
struct BankHead {
    int32_t* bins;
    float* lowWeights;
    float* highWeights;
    int32_t mode, fftLen, fftOrder, nFilter, capacity;
    float melMul, melDiv;
    uint8_t initialised;
};

float melOf(double f, double mul, double div) { return static_cast<float>(mul * std::log(1.0 + f / div)); }

// Corners and weights straight from the construction steps.
struct Model {
    std::vector<int> bins;
    std::vector<std::vector<float>> low, high;  // per filter, indexed from a and from c + 1
};

Model model(int fftLen, float fs, float lo, float hi, int nf, float mul, float div, bool mel) {
    Model m;
    const float melLow = melOf(lo, mul, div), melHigh = melOf(hi, mul, div);
    const float diff = melHigh - melLow;
    std::vector<float> centre(nf + 2);
    for (int k = 0; k < nf + 2; ++k) {
        centre[k] = static_cast<float>(k * double(diff) / double(float(nf + 1)) + melLow);
        const float e = static_cast<float>(std::exp(double(centre[k]) / mul) - 1.0);
        const float p = static_cast<float>(double(fftLen) / fs * div * e);
        m.bins.push_back(mel ? static_cast<int>(p) : static_cast<int>(std::nearbyint(p)));
    }
    for (int k = 1; k <= nf; ++k) {
        const int a = m.bins[k - 1], c = m.bins[k], b = m.bins[k + 1];
        std::vector<float> lw, hw;
        if (mel) {
            auto mb = [&](int i) { return double(melOf(double(i) * fs / fftLen, mul, div)); };
            lw.push_back(0.0f);
            for (int i = a + 1; i <= c; ++i)
                lw.push_back(static_cast<float>((mb(i) - centre[k - 1]) / (double(centre[k]) - centre[k - 1])));
            for (int i = c + 1; i <= b; ++i)
                hw.push_back(static_cast<float>((centre[k + 1] - mb(i)) / (double(centre[k + 1]) - centre[k])));
        } else {
            for (int i = a; i <= c; ++i) lw.push_back(static_cast<float>(double(i - a + 1) / (c - a + 1)));
            for (int i = c + 1; i <= b; ++i) hw.push_back(static_cast<float>(double(b + 1 - i) / (b - c + 1)));
        }
        m.low.push_back(lw);
        m.high.push_back(hw);
    }
    return m;
}

std::vector<float> evalModel(const Model& m, const std::vector<float>& s) {
    std::vector<float> out;
    for (size_t k = 1; k + 1 < m.bins.size(); ++k) {
        const int a = m.bins[k - 1], c = m.bins[k];
        volatile float rise = 0, fall = 0;
        for (size_t i = 0; i < m.low[k - 1].size(); ++i) {
            volatile float p = m.low[k - 1][i] * s[a + i];
            rise = rise + p;
        }
        for (size_t i = 0; i < m.high[k - 1].size(); ++i) {
            volatile float p = m.high[k - 1][i] * s[c + 1 + i];
            fall = fall + p;
        }
        volatile float sum = rise + fall;
        out.push_back(float(sum));
    }
    return out;
}

TEST_P(MelFBank, ConstructionAndEvaluationMatchTheSteps) {
    struct Case { int winLen; float fs, lo, hi; int nf; int mode; };
    for (Case c : {Case{400, 16000, 64, 8000, 26, 1}, Case{400, 16000, 64, 8000, 26, 2},
                   Case{256, 8000, 100, 3800, 20, 1}, Case{300, 11025, 30, 5000, 12, 2}}) {
        void* bank = nullptr;
        int order = 0;
        ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&bank, &order, c.winLen, c.fs, c.lo, c.hi, c.nf,
                                                2595.0f, 700.0f, c.mode), StatusOk);
        BankHead h;
        std::memcpy(&h, bank, sizeof h);
        const int fftLen = 1 << order;
        EXPECT_EQ(h.fftLen, fftLen);
        EXPECT_GE(fftLen, c.winLen);
        EXPECT_LT(fftLen / 2, c.winLen);
        EXPECT_EQ(h.nFilter, c.nf);
        EXPECT_EQ(h.initialised, 1);
        const Model m = model(fftLen, c.fs, c.lo, c.hi, c.nf, 2595.0f, 700.0f, c.mode == 1);
        for (int k = 0; k < c.nf + 2; ++k) ASSERT_EQ(h.bins[k], m.bins[k]) << k;

        std::mt19937 g(c.nf);
        std::uniform_real_distribution<float> u(0, 10);
        std::vector<float> spec(fftLen / 2 + 1);
        for (float& v : spec) v = u(g);
        std::vector<float> out(c.nf);
        ASSERT_EQ(z().zorsEvalFBank_32f(spec.data(), out.data(), bank), StatusOk);
        const auto want = evalModel(m, spec);
        for (int k = 0; k < c.nf; ++k) EXPECT_EQ(out[k], want[k]) << "mode " << c.mode << " filter " << k;
        EXPECT_EQ(z().zorsFBankFree_32f(bank), StatusOk);
    }
}

TEST_P(MelFBank, FrequencyWeightsExample) {
    // With linear weights a filter a = 10, c = 12, b = 15 rises 1/3, 2/3, 1 and falls 3/4, 2/4, 1/4.
    const std::vector<int> bins = {10, 12, 15};
    Model m;
    m.bins = bins;
    const int a = 10, c = 12, b = 15;
    for (int i = a; i <= c; ++i) EXPECT_FLOAT_EQ(float(i - a + 1) / (c - a + 1), (i - a + 1) / 3.0f);
    for (int i = c + 1; i <= b; ++i) EXPECT_FLOAT_EQ(float(b + 1 - i) / (b - c + 1), (b + 1 - i) / 4.0f);
    // and the same numbers come out of a real bank: every filter's rise ends at exactly 1
    void* bank = nullptr;
    int order = 0;
    ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&bank, &order, 512, 16000, 100, 8000, 20, 2595, 700, 2), 0);
    BankHead h;
    std::memcpy(&h, bank, sizeof h);
    std::vector<float> onlyCentre(257, 0.0f);
    for (int k = 1; k <= 20; ++k) {
        if (h.bins[k] == h.bins[k - 1]) continue;
        std::fill(onlyCentre.begin(), onlyCentre.end(), 0.0f);
        onlyCentre[h.bins[k]] = 1.0f;
        std::vector<float> out(20);
        ASSERT_EQ(z().zorsEvalFBank_32f(onlyCentre.data(), out.data(), bank), StatusOk);
        EXPECT_EQ(out[k - 1], 1.0f) << k;
    }
    EXPECT_EQ(z().zorsFBankFree_32f(bank), StatusOk);
}

TEST_P(MelFBank, OwnTransformFeedsMagnitudes) {
    for (int mode : {5, 6}) {
        void* bank = nullptr;
        void* plain = nullptr;
        int order = 0, order2 = 0;
        ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&bank, &order, 400, 16000, 64, 8000, 26, 2595, 700, mode), 0);
        ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&plain, &order2, 400, 16000, 64, 8000, 26, 2595, 700,
                                                mode - 4), 0);
        EXPECT_EQ(order, 9);
        const int n = 1 << order;
        std::mt19937 g(mode);
        std::uniform_real_distribution<float> u(-1, 1);
        std::vector<float> frame(n);
        for (float& v : frame) v = u(g);
        // magnitudes from a double DFT
        std::vector<float> mag(n / 2 + 1);
        for (int k = 0; k <= n / 2; ++k) {
            double re = 0, im = 0;
            for (int t = 0; t < n; ++t) {
                const double a = -2 * kPi * double(k) * t / n;
                re += frame[t] * std::cos(a);
                im += frame[t] * std::sin(a);
            }
            mag[k] = static_cast<float>(std::sqrt(re * re + im * im));
        }
        std::vector<float> a(26), b(26);
        ASSERT_EQ(z().zorsEvalFBank_32f(frame.data(), a.data(), bank), StatusOk);
        ASSERT_EQ(z().zorsEvalFBank_32f(mag.data(), b.data(), plain), StatusOk);
        for (int k = 0; k < 26; ++k) EXPECT_NEAR(a[k], b[k], 1e-4f * (1 + std::fabs(b[k]))) << k;
        EXPECT_EQ(z().zorsFBankFree_32f(bank), StatusOk);
        EXPECT_EQ(z().zorsFBankFree_32f(plain), StatusOk);
    }
}

// The bank's own transform gives exactly the magnitudes of the real
// transform followed by the complex magnitude, at every length (the short
// and long ones take another route than the middle ones).
TEST_P(MelFBank, OwnTransformIsTheTransformThenTheMagnitude) {
    const auto& a = z();
    std::mt19937 g(11);
    std::uniform_real_distribution<float> u(-1000, 1000);
    for (int order = 1; order <= 11; ++order) {
        const int n = 1 << order;
        void* bank = nullptr;
        void* plain = nullptr;
        void* spec = nullptr;
        int o1 = 0, o2 = 0;
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&bank, &o1, n, 16000, 64, 8000, 10, 2595, 700, 6), StatusOk);
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&plain, &o2, n, 16000, 64, 8000, 10, 2595, 700, 2), StatusOk);
        ASSERT_EQ(o1, order);
        ASSERT_EQ(a.zorsFFTInitAlloc_R_32f(&spec, order, 8, 2), StatusOk);
        for (int trial = 0; trial < 3; ++trial) {
            std::vector<float> frame(n), ccs(n + 2), mag(n / 2 + 1);
            for (float& v : frame) v = u(g);
            if (trial == 2) frame[n / 3] = std::numeric_limits<float>::infinity();
            ASSERT_EQ(a.zorsFFTFwd_RToCCS_32f(frame.data(), ccs.data(), spec, nullptr), StatusOk);
            ASSERT_EQ(a.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(ccs.data()), mag.data(), n / 2 + 1),
                      StatusOk);
            std::vector<float> got(10), want(10);
            ASSERT_EQ(a.zorsEvalFBank_32f(frame.data(), got.data(), bank), StatusOk);
            ASSERT_EQ(a.zorsEvalFBank_32f(mag.data(), want.data(), plain), StatusOk);
            EXPECT_EQ(std::memcmp(got.data(), want.data(), sizeof(float) * 10), 0) << order << " " << trial;
        }
        EXPECT_EQ(a.zorsFFTFree_R_32f(spec), StatusOk);
        EXPECT_EQ(a.zorsFBankFree_32f(bank), StatusOk);
        EXPECT_EQ(a.zorsFBankFree_32f(plain), StatusOk);
    }
}

TEST_P(MelFBank, ChecksAndCodes) {
    const auto& a = z();
    void* bank = nullptr;
    int order = -1;
    auto init = [&](int winLen, float fs, float lo, float hi, int nf, int mode) {
        return a.zorsMelFBankInitAlloc_32f(&bank, &order, winLen, fs, lo, hi, nf, 2595, 700, mode);
    };
    EXPECT_EQ(a.zorsMelFBankInitAlloc_32f(nullptr, &order, 0, 0, 0, 0, 0, 1, 1, 0), StatusNullPointer);
    EXPECT_EQ(a.zorsMelFBankInitAlloc_32f(&bank, nullptr, 400, 16000, 64, 8000, 26, 1, 1, 1),
              StatusNullPointer);
    EXPECT_EQ(init(0, 16000, 64, 8000, 26, 1), StatusBadSize);
    EXPECT_EQ(init(400, 16000, 64, 8000, 0, 1), StatusBadSize);
    EXPECT_EQ(init(400, 0, 64, 8000, 26, 1), StatusBadSize);
    EXPECT_EQ(init(400, 16000, 0, 8000, 26, 1), StatusBadSize);
    EXPECT_EQ(init(400, 16000, 64, 63, 26, 1), StatusBadFrequencyRange);
    EXPECT_EQ(init(400, 16000, 64, 8001, 26, 1), StatusBadFrequencyRange);
    for (int mode : {0, 3, 8, 7}) EXPECT_EQ(init(400, 16000, 64, 8000, 26, mode), StatusBadMelMode);
    EXPECT_EQ(bank, nullptr);
    EXPECT_EQ(order, -1);
    // high frequency equal to half the sampling rate is accepted
    ASSERT_EQ(init(400, 16000, 64, 8000, 26, 6), StatusOk);
    EXPECT_EQ(order, 9);
    EXPECT_EQ(a.zorsFBankFree_32f(bank), StatusOk);
    for (int w : {1, 2}) {
        ASSERT_EQ(init(w, 16000, 64, 8000, 4, 1), StatusOk);
        EXPECT_EQ(order, 1);
        EXPECT_EQ(a.zorsFBankFree_32f(bank), StatusOk);
    }
    ASSERT_EQ(init(400, 16000, 64, 8000, 26, 1), StatusOk);
    float s[257] = {}, d[26];
    EXPECT_EQ(a.zorsEvalFBank_32f(nullptr, d, bank), StatusNullPointer);
    EXPECT_EQ(a.zorsEvalFBank_32f(s, nullptr, bank), StatusNullPointer);
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, nullptr), StatusNullPointer);
    // a bank whose construction did not finish
    BankHead* h = static_cast<BankHead*>(bank);
    h->initialised = 0;
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusBankNotReady);
    int32_t* bins = h->bins;
    h->bins = nullptr;
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusNullPointer);
    h->bins = bins;
    EXPECT_EQ(a.zorsFBankFree_32f(bank), StatusOk);
    EXPECT_EQ(a.zorsFBankFree_32f(nullptr), StatusNullPointer);
    // NaN frequencies pass the comparisons but give no usable corners
    EXPECT_EQ(init(400, 16000, NAN, NAN, 26, 1), StatusBadFrequencyRange);
}

ZT_ALL_VARIANTS(MelFBank);

}  // namespace
