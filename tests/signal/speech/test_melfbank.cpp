// Mel filter bank: construction against its defining formulas, evaluation,
// the bank's own transform, checks and codes.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

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

// Each value rounded to float where the definition rounds it (volatile: the
// x87 unit would keep more).
float melOf(double f) {
    volatile float m = static_cast<float>(2595.0 * std::log(1.0 + f / 700.0));
    return m;
}

// The filters by their definition: nf + 2 centres evenly spaced in mel,
// their bins (truncated for mel weights, nearest for linear ones), then each
// filter's weight at bin i, rising from a to c and falling from c + 1 to b:
// in mel, (mel(i) - centre) over the centre spacing, linearly (i - a + 1) /
// (c - a + 1) and (b + 1 - i) / (b - c + 1); the output is the float sum of
// the rising products in increasing i, plus that of the falling ones.
struct Filters {
    std::vector<int> bins;
    std::vector<float> out;
    Filters(int n, float fs, float lo, float hi, int nf, bool mel, const std::vector<float>& s) {
        volatile float melLow = melOf(lo), melHigh = melOf(hi), diff = melHigh - melLow;
        std::vector<float> centre(nf + 2);
        for (int k = 0; k < nf + 2; ++k) {
            centre[k] = static_cast<float>(k * double(diff) / double(float(nf + 1)) + melLow);
            volatile float e = static_cast<float>(std::exp(double(centre[k]) / 2595.0) - 1.0);
            volatile float p = static_cast<float>(double(n) / fs * 700.0 * e);
            bins.push_back(mel ? static_cast<int>(p) : static_cast<int>(std::nearbyint(p)));
        }
        const auto melBin = [&](int i) { return double(melOf(double(i) * fs / n)); };
        for (int k = 1; k <= nf; ++k) {
            const int a = bins[k - 1], c = bins[k], b = bins[k + 1];
            const double m0 = centre[k - 1], m1 = centre[k], m2 = centre[k + 1];
            volatile float rise = 0, fall = 0;
            for (int i = a + (mel ? 1 : 0); i <= c; ++i) {
                volatile float w = mel ? float((melBin(i) - m0) / (m1 - m0)) : float(double(i - a + 1) / (c - a + 1));
                volatile float p = w * s[i];
                rise = rise + p;
            }
            for (int i = c + 1; i <= b; ++i) {
                volatile float w = mel ? float((m2 - melBin(i)) / (m2 - m1)) : float(double(b + 1 - i) / (b - c + 1));
                volatile float p = w * s[i];
                fall = fall + p;
            }
            out.push_back(float(rise + fall));
        }
    }
};

// The spectrum ends against a guard page: no filter reads past bin n / 2.
TEST_P(MelFBank, ConstructionAndEvaluationFollowTheDefinition) {
    struct Case { int winLen; float fs, lo, hi; int nf; int mode; };
    for (Case c : {Case{400, 16000, 64, 8000, 26, 1}, Case{400, 16000, 64, 8000, 26, 2},
                   Case{256, 8000, 100, 3800, 20, 1}, Case{300, 11025, 30, 5000, 12, 2}}) {
        void* bank = nullptr;
        int order = 0;
        ASSERT_EQ(z().zorsMelFBankInitAlloc_32f(&bank, &order, c.winLen, c.fs, c.lo, c.hi, c.nf, 2595.0f, 700.0f,
                                                c.mode), StatusOk);
        const BankHead& h = *static_cast<const BankHead*>(bank);
        const int n = 1 << order;
        EXPECT_TRUE(h.fftLen == n && n >= c.winLen && n / 2 < c.winLen && h.nFilter == c.nf && h.initialised == 1);
        const std::vector<float> spec = zt::randomFloats(n / 2 + 1, c.nf, 10.0f);
        zt::GuardedBuffer guarded(spec.size() * sizeof(float));
        std::memcpy(guarded.data(), spec.data(), guarded.size());
        const Filters want(n, c.fs, c.lo, c.hi, c.nf, c.mode == 1, spec);
        for (int k = 0; k < c.nf + 2; ++k) ASSERT_EQ(h.bins[k], want.bins[k]) << k;
        std::vector<float> out(c.nf);
        ASSERT_EQ(z().zorsEvalFBank_32f(guarded.as<float>(), out.data(), bank), StatusOk);
        for (int k = 0; k < c.nf; ++k) EXPECT_EQ(out[k], want.out[k]) << "mode " << c.mode << " filter " << k;
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
        int o1 = 0, o2 = 0;
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&bank, &o1, n, 16000, 64, 8000, 10, 2595, 700, 5 + order % 2), StatusOk);
        ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&plain, &o2, n, 16000, 64, 8000, 10, 2595, 700, 1 + order % 2), StatusOk);
        ASSERT_EQ(a.zorsFFTInitAlloc_R_32f(&spec, order, 8, 2), StatusOk);
        std::vector<float> frame = zt::randomFloats(n, order), ccs(n + 2), mag(n / 2 + 1), got(10), want(10);
        if (order % 3 == 0) frame[n / 3] = std::numeric_limits<float>::infinity();
        ASSERT_EQ(a.zorsFFTFwd_RToCCS_32f(frame.data(), ccs.data(), spec, nullptr), StatusOk);
        ASSERT_EQ(a.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(ccs.data()), mag.data(), n / 2 + 1), 0);
        ASSERT_EQ(a.zorsEvalFBank_32f(frame.data(), got.data(), bank), StatusOk);
        ASSERT_EQ(a.zorsEvalFBank_32f(mag.data(), want.data(), plain), StatusOk);
        EXPECT_TRUE(o1 == order && std::memcmp(got.data(), want.data(), sizeof(float) * 10) == 0) << order;
        EXPECT_TRUE(!a.zorsFFTFree_R_32f(spec) && !a.zorsFBankFree_32f(bank) && !a.zorsFBankFree_32f(plain));
    }
}

TEST_P(MelFBank, ChecksAndCodes) {
    const zt::Api& a = z();
    void* bank = nullptr;
    int order = -1;
    const std::vector<zt::Watch> w{zt::watch(&bank, sizeof bank), zt::watch(&order, sizeof order)};
    // Pointers, sizes, the frequency range, then the mode; a high frequency
    // of half the sampling rate is accepted; NaN frequencies pass the
    // comparisons but give no usable corners.
    zt::expectChecks(a.zorsMelFBankInitAlloc_32f, {&bank, &order, 400, 16000.0f, 64.0f, 8000.0f, 26, 2595.0f, 700.0f, 6},
                     w, zt::eachNull(), zt::bad(StatusBadSize, zt::arg<2>(0)), zt::bad(StatusBadSize, zt::arg<6>(0)),
                     zt::bad(StatusBadSize, zt::arg<3>(0.0f)), zt::bad(StatusBadSize, zt::arg<4>(0.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<5>(63.0f)), zt::bad(StatusBadFrequencyRange, zt::arg<5>(8001.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<4>(NAN), zt::arg<5>(NAN)),
                     zt::bad(StatusBadMelMode, zt::arg<9>(0)), zt::bad(StatusBadMelMode, zt::arg<9>(3)),
                     zt::bad(StatusBadMelMode, zt::arg<9>(8)), zt::bad(StatusBadMelMode, zt::arg<9>(7)),
                     zt::bad(StatusNullPointer, zt::arg<1>(nullptr), zt::arg<2>(0)),
                     zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<5>(63.0f)),
                     zt::bad(StatusBadFrequencyRange, zt::arg<5>(63.0f), zt::arg<9>(0)));
    EXPECT_TRUE(order == 9 && !a.zorsFBankFree_32f(bank));
    for (int win : {1, 2})  // the shortest transform has two points
        EXPECT_TRUE(!a.zorsMelFBankInitAlloc_32f(&bank, &order, win, 16000, 64, 8000, 4, 2595, 700, 1) && order == 1 &&
                    !a.zorsFBankFree_32f(bank));
    ASSERT_EQ(a.zorsMelFBankInitAlloc_32f(&bank, &order, 400, 16000, 64, 8000, 26, 2595, 700, 1), StatusOk);
    float s[257] = {}, d[26] = {};
    zt::expectChecks(a.zorsEvalFBank_32f, {s, d, bank}, {zt::watch(d, sizeof d)}, zt::eachNull());
    // A bank whose construction did not finish, or without its corners.
    BankHead* h = static_cast<BankHead*>(bank);
    h->initialised = 0;
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusBankNotReady);
    int32_t* bins = h->bins;
    h->bins = nullptr;
    EXPECT_EQ(a.zorsEvalFBank_32f(s, d, bank), StatusNullPointer);
    h->bins = bins;
    EXPECT_EQ(a.zorsFBankFree_32f(bank), StatusOk);
    EXPECT_EQ(a.zorsFBankFree_32f(nullptr), StatusNullPointer);
}

ZT_ALL_VARIANTS(MelFBank);

}  // namespace
