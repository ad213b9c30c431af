// Mel filter bank: construction against its defining formulas, evaluation,
// the bank's own transform, checks and codes.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <utility>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class MelFBank : public zt::VariantTest {};

// The published head of the bank record.
struct BankHead {
    int32_t* bins;
    float *lowWeights, *highWeights;
    int32_t mode, fftLen, fftOrder, nFilter, capacity;
    float melMul, melDiv;
    uint8_t initialised;
};

// The filters by their definition: nf + 2 centres evenly spaced in mel,
// their bins (truncated for mel weights, nearest for linear ones), then each
// filter's weight at bin i, rising from a to c and falling from c + 1 to b:
// in mel, (mel(i) - centre) over the centre spacing, linearly (i - a + 1) /
// (c - a + 1) and (b + 1 - i) / (b - c + 1); the output is the float sum of
// the rising products in increasing i, plus that of the falling ones.  Each
// value is rounded to float where the definition rounds it (volatile: the
// x87 unit would keep more).
std::vector<float> filtered(int n, float fs, float lo, float hi, int nf, bool mel, const float* s, std::vector<int>& bins) {
    const auto melOf = [](double f) -> float { volatile float m = float(2595.0 * std::log(1.0 + f / 700.0)); return m; };
    volatile float melLow = melOf(lo), melHigh = melOf(hi), diff = melHigh - melLow;
    std::vector<float> centre(nf + 2), out;
    for (int k = 0; k < nf + 2; ++k) {
        centre[k] = static_cast<float>(k * double(diff) / double(float(nf + 1)) + melLow);
        volatile float e = static_cast<float>(std::exp(double(centre[k]) / 2595.0) - 1.0);
        volatile float p = static_cast<float>(double(n) / fs * 700.0 * e);
        bins.push_back(mel ? static_cast<int>(p) : static_cast<int>(std::nearbyint(p)));
    }
    for (int k = 1; k <= nf; ++k) {
        const int a = bins[k - 1], c = bins[k], b = bins[k + 1];
        const double m0 = centre[k - 1], m1 = centre[k], m2 = centre[k + 1];
        volatile float sum[2] = {0, 0};  // rising, falling
        for (int i = a + mel; i <= b; ++i) {
            const double m = melOf(double(i) * fs / n);
            volatile float w = i <= c ? float(mel ? (m - m0) / (m1 - m0) : double(i - a + 1) / (c - a + 1))
                                      : float(mel ? (m2 - m) / (m2 - m1) : double(b + 1 - i) / (b - c + 1));
            volatile float p = w * s[i];
            sum[i > c] = sum[i > c] + p;
        }
        out.push_back(float(sum[0] + sum[1]));
    }
    return out;
}

// The spectrum ends against a guard page: no filter reads past bin n / 2.
TEST_P(MelFBank, ConstructionAndEvaluationFollowTheDefinition) {
    struct { int winLen; float fs, lo, hi; int nf, mode; } const cases[] = {
        {400, 16000, 64, 8000, 26, 1}, {400, 16000, 64, 8000, 26, 2}, {256, 8000, 100, 3800, 20, 1},
        {300, 11025, 30, 5000, 12, 2}};
    for (const auto& c : cases) {
        void* bank = nullptr;
        int order = 0;
        ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&bank, &order, c.winLen, c.fs, c.lo, c.hi, c.nf, 2595, 700, c.mode), 0);
        const BankHead& h = *static_cast<const BankHead*>(bank);
        const int n = 1 << order;
        EXPECT_TRUE(h.fftLen == n && n >= c.winLen && n / 2 < c.winLen && h.nFilter == c.nf && h.initialised == 1);
        const std::vector<float> v = zt::randomFloats(n / 2 + 1, c.nf, 10.0f);
        zt::GuardedBuffer spectrum(v.size() * sizeof(float));
        std::memcpy(spectrum.data(), v.data(), spectrum.size());
        std::vector<int> bins;
        const std::vector<float> want = filtered(n, c.fs, c.lo, c.hi, c.nf, c.mode == 1, v.data(), bins);
        std::vector<float> out(c.nf);
        ASSERT_EQ(z().zorsEvalFBank_32f(spectrum.as<float>(), out.data(), bank), StatusOk);
        EXPECT_EQ(std::vector<int>(h.bins, h.bins + c.nf + 2), bins) << "mode " << c.mode;
        EXPECT_EQ(out, want) << "mode " << c.mode;
        EXPECT_EQ(z().zorsFBankFree_32f(bank), StatusOk);
    }
}

// The bank's own transform gives exactly the magnitudes of the real
// transform followed by the complex magnitude, at every length (the short
// and long ones take another route than the middle ones), infinities too.
TEST_P(MelFBank, OwnTransformIsTheTransformThenTheMagnitude) {
    const zt::Api& a = z();
    for (int order = 1; order <= 11; ++order) {
        const int n = 1 << order;
        void *bank = nullptr, *plain = nullptr, *spec = nullptr;
        int o = 0;
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&bank, &o, n, 16000, 64, 8000, 10, 2595, 700, 5 + order % 2), StatusOk);
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&plain, &o, n, 16000, 64, 8000, 10, 2595, 700, 1 + order % 2), StatusOk);
        ASSERT_EQ(a.zorsFFTInitAlloc_R_32f(&spec, order, 8, 2), StatusOk);
        std::vector<float> frame = zt::randomFloats(n, order), ccs(n + 2), mag(n / 2 + 1), got(10), want(10);
        if (order % 3 == 0) frame[n / 3] = INFINITY;
        ASSERT_EQ(a.zorsFFTFwd_RToCCS_32f(frame.data(), ccs.data(), spec, nullptr), StatusOk);
        ASSERT_EQ(a.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(ccs.data()), mag.data(), n / 2 + 1), 0);
        ASSERT_EQ(a.zorsEvalFBank_32f(frame.data(), got.data(), bank), StatusOk);
        ASSERT_EQ(a.zorsEvalFBank_32f(mag.data(), want.data(), plain), StatusOk);
        EXPECT_EQ(std::memcmp(got.data(), want.data(), sizeof(float) * 10), 0) << order;
        EXPECT_TRUE(!a.zorsFFTFree_R_32f(spec) && !a.zorsFBankFree_32f(bank) && !a.zorsFBankFree_32f(plain));
    }
}

// Pointers, sizes, the frequency range, then the mode; a high frequency of
// half the sampling rate is accepted; NaN frequencies pass the comparisons
// but give no usable corners; a mode is one kind of weights, with or without
// the spectrum bit, and nothing else.  Evaluation refuses a bank whose construction
// did not finish, or without its corners.
TEST_P(MelFBank, ChecksAndCodes) {
    const zt::Api& a = z();
    void* bank = nullptr;
    int order = -1;
    zt::expectChecks(a.zorsMelFBankInitAlloc_32f, {&bank, &order, 400, 16000.0f, 64.0f, 8000.0f, 26, 2595.0f, 700.0f, 6},
                     {zt::watch(&bank, sizeof bank), zt::watch(&order, sizeof order)}, zt::eachNull(), zt::badLength<2>(),
                     zt::badLength<6>(), zt::bad(StatusBadSize, zt::arg<3>(0.0f)), zt::bad(StatusBadSize, zt::arg<4>(0.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<5>(63.0f)), zt::bad(StatusBadFrequencyRange, zt::arg<5>(8001.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<4>(NAN), zt::arg<5>(NAN)), zt::bad(StatusBadMelMode, zt::arg<9>(3)),
                     zt::bad(StatusBadMelMode, zt::arg<9>(9)), zt::bad(StatusNullPointer, zt::arg<1>(nullptr), zt::arg<2>(0)),
                     zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<5>(63.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<5>(63.0f), zt::arg<9>(0)));
    float s[512] = {}, d[26] = {};  // frames of the valid call's bank
    zt::expectChecks(a.zorsEvalFBank_32f, {s, d, bank}, {zt::watch(d, sizeof d)}, zt::eachNull());
    BankHead* h = static_cast<BankHead*>(bank);
    int32_t* bins = std::exchange(h->bins, nullptr);
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusNullPointer);
    h->bins = bins;
    h->initialised = 0;
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusBankNotReady);
    EXPECT_TRUE(order == 9 && !a.zorsFBankFree_32f(bank));
    for (int win : {1, 2})  // the shortest transform has two points
        EXPECT_TRUE(!a.zorsMelFBankInitAlloc_32f(&bank, &order, win, 16000, 64, 8000, 4, 2595, 700, 1) && order == 1 &&
                    !a.zorsFBankFree_32f(bank));
}

ZT_ALL_VARIANTS(MelFBank);

}  // namespace
