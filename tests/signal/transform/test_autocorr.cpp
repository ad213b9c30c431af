// Autocorrelation: double sums rounded once (few lags: exactly; many lags:
// to float rounding), identical on every variant.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class AutoCorr : public zt::VariantTest {};

// Lag k: the sum of x[n] x[n + k] in double; lags past the signal are 0.
// Short cases must give it rounded once; long signals with many lags go
// through the spectrum and land within float rounding (plus a sliver of
// lag 0).  Nothing is read past srcLen nor written past dstLen (guarded).
TEST_P(AutoCorr, MatchesDoubleSums) {
    const struct { int srcLen, dstLen; bool exact; } cases[] = {
        {1, 1, true}, {2, 3, true}, {3, 8, true}, {5, 5, true}, {7, 1, true}, {16, 3, true}, {33, 38, true},
        {250, 250, true}, {256, 256, false}, {1000, 600, false}, {3001, 5000, false}, {4096, 4096, false}};
    for (const auto& c : cases) {
        std::vector<float> x = zt::randomFloats(c.srcLen, c.srcLen, 1.0f);
        for (float& v : x) v += 0.25f;  // a mean, so lag 0 dominates
        zt::GuardedBuffer in(c.srcLen * sizeof(float));
        std::memcpy(in.data(), x.data(), in.size());
        zt::GuardedBuffer out(c.dstLen * sizeof(float));
        float* d = static_cast<float*>(std::memset(out.data(), 0xFF, out.size()));
        ASSERT_EQ(z().zorsAutoCorr_32f(in.as<float>(), c.srcLen, d, c.dstLen), StatusOk);
        double lag0 = 0;
        for (float v : x) lag0 += double(v) * v;
        for (int k = 0; k < c.dstLen; ++k) {
            volatile double acc = 0;
            for (int n = 0; n + k < c.srcLen; ++n) acc = acc + double(x[n]) * double(x[n + k]);
            const float want = static_cast<float>(acc);
            const double tol = c.exact ? 0 : std::ldexp(std::fabs(double(want)), -23) + 1e-13 * lag0;
            ASSERT_LE(std::fabs(double(d[k]) - want), tol) << c.srcLen << " " << c.dstLen << " " << k;
            ASSERT_TRUE(k < c.srcLen || d[k] == 0.0f);
        }
    }
}

TEST_P(AutoCorr, ChecksAndAgreement) {
    float x[3] = {1, 2, 3}, y[2] = {7, 7};
    zt::expectChecks(z().zorsAutoCorr_32f, {x, 3, y, 2}, {zt::watch(y, sizeof y)}, zt::eachNull(), zt::badLength<1>(),
                     zt::badLength<3>(), zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)));
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        const int n = c.len() * 4, m = c.roi().width * c.roi().height * 8;  // long enough for the spectrum
        return z.zorsAutoCorr_32f(c.in<float>(n), n, c.out<float>(m), m);
    });
}

ZT_ALL_VARIANTS(AutoCorr);

}  // namespace
