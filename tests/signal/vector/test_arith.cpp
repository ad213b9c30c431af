// Vector arithmetic and elementwise math, on every variant's entries.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <sstream>
#include <tuple>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecArith : public zt::VariantTest {};
using zt::Api;
using zt::Case;

uint32_t bitsOf(float x) { uint32_t u; std::memcpy(&u, &x, 4); return u; }
float floatOf(uint32_t u) { float x; std::memcpy(&x, &u, 4); return x; }
uint64_t bitsOf(double x) { uint64_t u; std::memcpy(&u, &x, 8); return u; }

const float kInf = std::numeric_limits<float>::infinity();
const float kNaN = std::numeric_limits<float>::quiet_NaN();
const uint32_t kNegNaN = 0xFFC00000u;

// The first element whose bits differ, with its inputs.
::testing::AssertionResult bitsEqual(const std::vector<float>& got, const std::vector<float>& want,
                                     const std::vector<float>& in1, const std::vector<float>* in2 = nullptr) {
    for (size_t i = 0; i < got.size(); ++i)
        if (bitsOf(got[i]) != bitsOf(want[i])) {
            std::ostringstream m;
            m << std::hexfloat << "element " << i << ", input " << in1[i];
            if (in2) m << ", " << (*in2)[i];
            m << ": got " << got[i] << ", want " << want[i];
            return ::testing::AssertionFailure() << m.str();
        }
    return ::testing::AssertionSuccess();
}

// Pointers, then length argument L, on the valid call fn(a...).
template <size_t L, class... P, class... A>
void lengthChecks(const std::vector<zt::Watch>& w, Status(ZOR_CALL* fn)(P...), A... a) {
    zt::expectChecks(fn, std::tuple<P...>(a...), w, zt::eachNull(), zt::badLength<L>());
}

}  // namespace

TEST_P(VecArith, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    float f[16] = {1, 2, 3, 4, 5, 6, 7, 8}, d[8] = {};
    int16_t s[8] = {1, 2, 3}, t[8] = {};
    double x[8] = {1}, y[8] = {};
    const auto* c = reinterpret_cast<const Complex32f*>(f);
    const std::vector<zt::Watch> wf{zt::watch(d, sizeof d)}, ws{zt::watch(t, sizeof t)}, wd{zt::watch(y, sizeof y)};
    for (auto fn : {z.zorsAdd_32f, z.zorsMagnitude_32f, z.zorsPowerSpectr_32f, z.zorsPhase_32f})
        lengthChecks<3>(wf, fn, f, f, d, 8);
    for (auto fn : {z.zorsAdd_32f_I, z.zorsSub_32f_I, z.zorsMul_32f_I, z.zorsDiv_32f_I, z.zorsAbs_32f, z.zorsSqr_32f})
        lengthChecks<2>(wf, fn, f, d, 8);
    for (auto fn : {z.zorsAddC_32f_I, z.zorsSubC_32f_I, z.zorsMulC_32f_I, z.zorsDivC_32f_I}) lengthChecks<2>(wf, fn, 2.0f, d, 8);
    for (auto fn : {z.zorsSubC_32f, z.zorsMulC_32f, z.zorsDivC_32f}) lengthChecks<3>(wf, fn, f, 2.0f, d, 8);
    for (auto fn : {z.zorsAbs_32f_I, z.zorsSqr_32f_I, z.zorsSqrt_32f_I, z.zorsLn_32f_I, z.zorsSortDescend_32f_I})
        lengthChecks<1>(wf, fn, d, 8);
    lengthChecks<1>(wf, z.zorsThreshold_32f_I, d, 8, 1.0f, int(CmpGreater));
    lengthChecks<2>(wf, z.zorsThreshold_LTVal_32f, f, d, 8, 1.0f, 2.0f);
    lengthChecks<1>(wf, z.zorsThreshold_LTVal_32f_I, d, 8, 1.0f, 2.0f);
    lengthChecks<2>(wf, z.zorsMagnitude_32fc, c, d, 8);
    lengthChecks<3>(ws, z.zorsAdd_16s_Sfs, s, s, t, 8, 0);
    lengthChecks<2>(ws, z.zorsAddC_16s_I, int16_t(3), t, 8);
    lengthChecks<2>(ws, z.zorsSubC_16s_I, int16_t(3), t, 8);
    lengthChecks<2>(ws, z.zorsAbs_16s, s, t, 8);
    lengthChecks<1>(ws, z.zorsAbs_16s_I, t, 8);
    lengthChecks<2>(wd, z.zorsAbs_64f, x, y, 8);
    lengthChecks<1>(wd, z.zorsAbs_64f_I, y, 8);
    // The order: pointers, length, then the export's own arguments.
    zt::expectChecks(z.zorsAdd_32f, {f, f, d, 8}, wf, zt::bad(StatusNullPointer, zt::arg<1>(nullptr), zt::arg<3>(0)));
    zt::expectChecks(z.zorsDivC_32f, {f, 2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<1>(0.0f)),
                     zt::bad(StatusDivideByZero, zt::arg<1>(-0.0f)), zt::bad(StatusDivideByZero, zt::arg<1>(kNaN)),
                     zt::bad(StatusBadSize, zt::arg<1>(0.0f), zt::arg<3>(0)));
    zt::expectChecks(z.zorsDivC_32f_I, {2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<0>(kNaN)),
                     zt::bad(StatusNullPointer, zt::arg<0>(0.0f), zt::arg<1>(nullptr)));
    // Divisors below the smallest normal are refused; that one is accepted.
    zt::expectChecks(z.zorsNormalize_32f, {f, d, 8, 1.0f, -1.1754943508222875e-38f}, wf, zt::eachNull(),
                     zt::badLength<2>(), zt::bad(StatusDivideByZero, zt::arg<4>(1e-39f)),
                     zt::bad(StatusDivideByZero, zt::arg<4>(-1e-39f)), zt::bad(StatusDivideByZero, zt::arg<4>(kNaN)),
                     zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<4>(0.0f)));
    // The _NR members refuse a negative scale factor, after the length.
    zt::expectChecks(z.zorsMul_NR_16s_Sfs, {s, s, t, 8, 1}, ws, zt::eachNull(), zt::badLength<3>(),
                     zt::bad(StatusBadScaleFactor, zt::arg<4>(-1)), zt::bad(StatusBadSize, zt::arg<3>(0), zt::arg<4>(-1)));
    zt::expectChecks(z.zorsMul_NR_16s_ISfs, {s, t, 8, 1}, ws, zt::eachNull(), zt::badLength<2>(),
                     zt::bad(StatusBadScaleFactor, zt::arg<3>(-5)));
    zt::expectChecks(z.zorsMulC_NR_16s_Sfs, {s, int16_t(3), t, 8, 1}, ws, zt::eachNull(), zt::badLength<3>(),
                     zt::bad(StatusBadScaleFactor, zt::arg<4>(-1)));
    zt::expectChecks(z.zorsMulC_NR_16s_ISfs, {int16_t(3), t, 8, 1}, ws, zt::eachNull(), zt::badLength<2>(),
                     zt::bad(StatusBadScaleFactor, zt::arg<3>(-1)));
    // The arctangent checks the length before the pointers.
    zt::expectChecks(z.zorsAtan2_32f_A21, {f, f, d, 8}, wf, zt::eachNull(), zt::badLength<3>(),
                     zt::bad(StatusBadSize, zt::arg<0>(nullptr), zt::arg<3>(0)));
    // Deinterleave: pointers, channel count, length, then each plane.
    int16_t* planes[2] = {t, t + 4};
    int16_t* oneNull[2] = {t, nullptr};
    zt::expectChecks(z.zorsDeinterleave_16s, {s, 2, 4, planes}, ws, zt::eachNull(),
                     zt::bad(StatusBadChannelCount, zt::arg<1>(0)), zt::bad(StatusBadSize, zt::arg<2>(0)),
                     zt::bad(StatusNullPointer, zt::arg<3>(oneNull)), zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<1>(0)),
                     zt::bad(StatusBadChannelCount, zt::arg<1>(0), zt::arg<2>(0)),
                     zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<3>(oneNull)));
}

// Every variant against the generic entries: random floats with NaN,
// infinities, zeros and denormals, integers over their whole range.
TEST_P(VecArith, AgreesWithGeneric) {
    const int v = variant();
    for (auto fn : {&Api::zorsAdd_32f, &Api::zorsMagnitude_32f, &Api::zorsPowerSpectr_32f, &Api::zorsPhase_32f,
                    &Api::zorsAtan2_32f_A21})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) {
            const int n = c.len();
            return (z.*fn)(c.in(c.floats(n)), c.in(c.floats(n)), c.out<float>(n), n);
        });
    for (auto fn : {&Api::zorsAdd_32f_I, &Api::zorsSub_32f_I, &Api::zorsMul_32f_I, &Api::zorsDiv_32f_I,
                    &Api::zorsAbs_32f, &Api::zorsSqr_32f})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) {
            const int n = c.len();
            return (z.*fn)(c.in(c.floats(n)), c.inOut(c.floats(n)), n);
        });
    for (auto fn : {&Api::zorsAbs_32f_I, &Api::zorsSqr_32f_I, &Api::zorsSqrt_32f_I, &Api::zorsLn_32f_I})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) { return (z.*fn)(c.inOut(c.floats(c.len())), c.len()); });
    for (float k : {0.0f, 1.0f, -3.0f, 1e30f, 7e-3f}) {
        for (auto fn : {&Api::zorsAddC_32f_I, &Api::zorsSubC_32f_I, &Api::zorsMulC_32f_I, &Api::zorsDivC_32f_I})
            zt::agreesWithGeneric(v, [fn, k](const Api& z, Case& c) { return (z.*fn)(k, c.inOut(c.floats(c.len())), c.len()); });
        for (auto fn : {&Api::zorsSubC_32f, &Api::zorsMulC_32f, &Api::zorsDivC_32f})
            zt::agreesWithGeneric(v, [fn, k](const Api& z, Case& c) {
                return (z.*fn)(c.in(c.floats(c.len())), k, c.out<float>(c.len()), c.len());
            });
        zt::agreesWithGeneric(v, [k](const Api& z, Case& c) {
            const int n = c.len();
            return z.zorsThreshold_32f_I(c.inOut(c.floats(n)), n, k, n % 2 ? CmpGreater : CmpLess) +
                   z.zorsThreshold_LTVal_32f(c.in(c.floats(n)), c.out<float>(n), n, k, -5.0f) +
                   z.zorsThreshold_LTVal_32f_I(c.inOut(c.floats(n)), n, k, 2.0f) +
                   z.zorsNormalize_32f(c.in(c.floats(n)), c.out<float>(n), n, 0.3f, k);
        });
    }
    zt::agreesWithGeneric(v, [](const Api& z, Case& c) {
        const int n = c.len();
        return z.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(c.in(c.floats(2 * n))), c.out<float>(n), n) +
               z.zorsAbs_64f(c.in<double>(n), c.out<double>(n), n) + z.zorsAbs_64f_I(c.inOut<double>(n), n) +
               z.zorsAbs_16s(c.in<int16_t>(n), c.out<int16_t>(n), n) + z.zorsAbs_16s_I(c.inOut<int16_t>(n), n);
    });
    for (int sf : {-17, -16, -3, 0, 1, 2, 7, 16, 17, 30, 31, 45})
        zt::agreesWithGeneric(v, [sf](const Api& z, Case& c) {
            const int n = c.len();
            const int16_t k = int16_t(c.rng()());
            const int16_t* a = c.in<int16_t>(n);
            const int nr = sf < 0 ? 0 : sf;
            return z.zorsAdd_16s_Sfs(a, c.in<int16_t>(n), c.out<int16_t>(n), n, sf) +
                   z.zorsMul_NR_16s_Sfs(a, c.in<int16_t>(n), c.out<int16_t>(n), n, nr) +
                   z.zorsMul_NR_16s_ISfs(a, c.inOut<int16_t>(n), n, nr) +
                   z.zorsMulC_NR_16s_Sfs(a, k, c.out<int16_t>(n), n, nr) +
                   z.zorsMulC_NR_16s_ISfs(int16_t(-32768), c.inOut<int16_t>(n), n, nr) +
                   z.zorsAddC_16s_I(k, c.inOut<int16_t>(n), n) + z.zorsSubC_16s_I(int16_t(-32768), c.inOut<int16_t>(n), n);
        });
}

// ---- float arithmetic -----------------------------------------------------------

// A single float operation rounded once is the double result rounded once;
// special values pass as pinned.
TEST_P(VecArith, ElementwiseMatchesFloatArithmetic) {
    const Api& z = this->z();
    const int n = 37;
    const auto a = zt::randomFloats(n, 11), b = zt::randomFloats(n, 12, 1e-3f);
    // The export writes d (holding a); op(a[i], b[i]) is the element expected.
    const auto expect = [&](auto call, auto op) {
        std::vector<float> d = a, e(n);
        ASSERT_EQ(call(d.data()), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = op(a[i], b[i]);
        EXPECT_TRUE(bitsEqual(d, e, a, &b));
    };
    const auto sqr = [](float x, float) { return x * x; };
    expect([&](float* d) { return z.zorsAdd_32f(a.data(), b.data(), d, n); }, [](float x, float y) { return x + y; });
    expect([&](float* d) { return z.zorsAdd_32f_I(b.data(), d, n); }, [](float x, float y) { return x + y; });
    expect([&](float* d) { return z.zorsSub_32f_I(b.data(), d, n); }, [](float x, float y) { return x - y; });
    expect([&](float* d) { return z.zorsMul_32f_I(b.data(), d, n); }, [](float x, float y) { return x * y; });
    expect([&](float* d) { return z.zorsDiv_32f_I(b.data(), d, n); }, [](float x, float y) { return x / y; });
    expect([&](float* d) { return z.zorsSqr_32f(a.data(), d, n); }, sqr);
    expect([&](float* d) { return z.zorsSqr_32f_I(d, n); }, sqr);
    expect([&](float* d) { return z.zorsMulC_32f(a.data(), 3.5f, d, n); }, [](float x, float) { return x * 3.5f; });
    expect([&](float* d) { return z.zorsSubC_32f(a.data(), 0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    expect([&](float* d) { return z.zorsSubC_32f_I(0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    expect([&](float* d) { return z.zorsAddC_32f_I(-7.0f, d, n); }, [](float x, float) { return x + -7.0f; });
    expect([&](float* d) { return z.zorsMulC_32f_I(-7.0f, d, n); }, [](float x, float) { return x * -7.0f; });
    // Division by a constant multiplies by the float reciprocal (for 1/3 that
    // differs from division in the last bit of some elements).
    for (float val : {3.0f, -7.0f, 0.1f, 1e-30f}) {
        const auto byReciprocal = [val](float x, float) {
            volatile float r = 1.0f / val, p = x * r;  // volatile: kept out of x87 registers
            return float(p);
        };
        expect([&](float* d) { return z.zorsDivC_32f(a.data(), val, d, n); }, byReciprocal);
        expect([&](float* d) { return z.zorsDivC_32f_I(val, d, n); }, byReciprocal);
    }
    int differs = 0;
    for (float x : a) differs += x / 3.0f != static_cast<float>(x * (1.0f / 3.0f));
    EXPECT_GT(differs, 0);
    float q[2] = {1, -1};  // IEEE division by zero, no status
    const float zero[2] = {0, 0};
    EXPECT_EQ(z.zorsDiv_32f_I(zero, q, 2), StatusOk);
    EXPECT_TRUE(q[0] == kInf && q[1] == -kInf);

    // Multiplying by 1, subtracting -0 and dividing by 1 copy, even a
    // signalling NaN; multiplying by 0 and dividing by infinity zero
    // everything, without -0.  In-place subtraction of a constant has no
    // shortcut: -0 - 0 is -0 and the signalling NaN quiets.
    const float sNaN = floatOf(0x7F800001u);
    const std::vector<float> src = {sNaN, kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f};
    const std::vector<float> zeros(9, 0.0f);
    const auto pinned = [&](auto call, const std::vector<float>& want) {
        std::vector<float> d = src;
        ASSERT_EQ(call(d.data()), StatusOk);
        EXPECT_TRUE(bitsEqual(d, want, src));
    };
    pinned([&](float* d) { return z.zorsMulC_32f(src.data(), 1.0f, d, 9); }, src);
    pinned([&](float* d) { return z.zorsSubC_32f(src.data(), -0.0f, d, 9); }, src);
    pinned([&](float* d) { return z.zorsDivC_32f(src.data(), 1.0f, d, 9); }, src);
    pinned([&](float* d) { return z.zorsMulC_32f_I(1.0f, d, 9) + z.zorsAddC_32f_I(0.0f, d, 9); }, src);
    pinned([&](float* d) { return z.zorsMulC_32f(src.data(), 0.0f, d, 9); }, zeros);
    pinned([&](float* d) { return z.zorsMulC_32f_I(-0.0f, d, 9); }, zeros);
    pinned([&](float* d) { return z.zorsDivC_32f_I(-kInf, d, 9); }, zeros);
    pinned([&](float* d) { return z.zorsSubC_32f_I(0.0f, d, 9); },
           {floatOf(0x7FC00001u), kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f});
}

// Absolute value clears the sign bit; thresholds keep equal elements and
// NaNs, clipping from above for CmpGreater and from below for any other code;
// LTVal replaces what is below the level (and NaN).
TEST_P(VecArith, AbsAndThresholdsSelect) {
    const Api& z = this->z();
    const float qNaN = floatOf(0xFFC00001u);
    const std::vector<float> src = {-0.0f, -kInf, kNaN, qNaN, -2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    const auto pinned = [&](auto call, const std::vector<float>& want) {
        std::vector<float> d = src;
        ASSERT_EQ(call(d.data()), StatusOk);
        EXPECT_TRUE(bitsEqual(d, want, src));
    };
    const std::vector<float> abs = {0.0f, kInf, kNaN, floatOf(0x7FC00001u), 2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    pinned([&](float* d) { return z.zorsAbs_32f(src.data(), d, 9); }, abs);
    pinned([&](float* d) { return z.zorsAbs_32f_I(d, 9); }, abs);
    pinned([&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, CmpGreater); },
           {-0.0f, -kInf, kNaN, qNaN, -2.5f, 1.0f, 1.0f, 1.0f, 0.5f});
    for (int rel : {int(CmpLess), 1, 5, -1})
        pinned([&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, rel); },
               {1.0f, 1.0f, kNaN, qNaN, 1.0f, 3.0f, 1.0f, 1.0f, 1.0f});
    const std::vector<float> lt = {9.0f, 9.0f, 9.0f, 9.0f, 9.0f, 3.0f, 1.0f, 1.0f, 9.0f};
    pinned([&](float* d) { return z.zorsThreshold_LTVal_32f(src.data(), d, 9, 1.0f, 9.0f); }, lt);
    pinned([&](float* d) { return z.zorsThreshold_LTVal_32f_I(d, 9, 1.0f, 9.0f); }, lt);
}

// ---- 16-bit and 64-bit ------------------------------------------------------------

namespace {
// r * 2^-sf rounded to nearest (ties to even, or half up), saturated.
int16_t scaled(int64_t r, int sf, bool halfUp) {
    const long double v = std::ldexp(static_cast<long double>(r), -sf);
    long double f = std::floor(v);
    const long double frac = v - f;
    if (frac > 0.5L || (frac == 0.5L && (halfUp || std::fmod(f, 2.0L) != 0))) f += 1;
    return static_cast<int16_t>(std::clamp<long double>(f, -32768, 32767));
}
}  // namespace

TEST_P(VecArith, SixteenBitScalingRoundsAndSaturates) {
    const Api& z = this->z();
    std::mt19937 rng(3);
    const int n = 101;
    std::vector<int16_t> x(n), y(n);
    for (int i = 0; i < n; ++i) {
        x[i] = int16_t(i % 9 == 0 ? -32768 : i % 9 == 1 ? 32767 : int(rng()));
        y[i] = int16_t(i % 5 == 0 ? int(rng() % 7) - 3 : int(rng()));
    }
    // The export writes d (holding start); op(x[i], y[i]) is the element expected.
    const auto expect = [&](const std::vector<int16_t>& start, auto call, auto op) {
        std::vector<int16_t> d = start;
        ASSERT_EQ(call(d.data()), StatusOk);
        for (int i = 0; i < n; ++i) ASSERT_EQ(d[i], op(x[i], y[i])) << x[i] << ", " << y[i];
    };
    // The sum: ties to even; from -16 down only the sign survives.
    for (int sf = -18; sf <= 18; ++sf) {
        SCOPED_TRACE(sf);
        expect(x, [&](int16_t* d) { return z.zorsAdd_16s_Sfs(x.data(), y.data(), d, n, sf); }, [sf](int a, int b) {
            return sf > -16 ? scaled(a + b, sf, false) : int16_t(a + b > 0 ? 32767 : a + b < 0 ? -32768 : 0);
        });
    }
    // The products: half up, every factor from 0 to 40.
    for (int sf = 0; sf <= 40; ++sf) {
        SCOPED_TRACE(sf);
        const auto product = [sf](int a, int b) { return scaled(int64_t(a) * b, sf, true); };
        const auto byMin = [sf](int a, int) { return scaled(int64_t(a) * -32768, sf, true); };
        expect(x, [&](int16_t* d) { return z.zorsMul_NR_16s_Sfs(x.data(), y.data(), d, n, sf); }, product);
        expect(y, [&](int16_t* d) { return z.zorsMul_NR_16s_ISfs(x.data(), d, n, sf); }, product);
        expect(y, [&](int16_t* d) { return z.zorsMulC_NR_16s_Sfs(x.data(), -32768, d, n, sf); }, byMin);
        expect(x, [&](int16_t* d) { return z.zorsMulC_NR_16s_ISfs(-32768, d, n, sf); }, byMin);
    }
    // Constants saturate (and 0 leaves the vector alone); |-32768| is 32767.
    for (int c : {-32768, -1000, 0, 1, 32767}) {
        expect(x, [&](int16_t* d) { return z.zorsAddC_16s_I(int16_t(c), d, n); },
               [c](int a, int) { return std::clamp(a + c, -32768, 32767); });
        expect(x, [&](int16_t* d) { return z.zorsSubC_16s_I(int16_t(c), d, n); },
               [c](int a, int) { return std::clamp(a - c, -32768, 32767); });
    }
    const auto abs = [](int a, int) { return std::min(32767, std::abs(a)); };
    expect(y, [&](int16_t* d) { return z.zorsAbs_16s(x.data(), d, n); }, abs);
    expect(x, [&](int16_t* d) { return z.zorsAbs_16s_I(d, n); }, abs);

    const std::vector<double> ds = {-0.0, -1.5, -std::numeric_limits<double>::quiet_NaN(), -1e300, 2.0};
    std::vector<double> dd(5);
    ASSERT_EQ(z.zorsAbs_64f(ds.data(), dd.data(), 5), StatusOk);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(bitsOf(dd[i]), bitsOf(ds[i]) & 0x7FFFFFFFFFFFFFFFull) << i;
    dd = ds;
    ASSERT_EQ(z.zorsAbs_64f_I(dd.data(), 5), StatusOk);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(bitsOf(dd[i]), bitsOf(ds[i]) & 0x7FFFFFFFFFFFFFFFull) << i;
}

// ---- square root, logarithm, magnitude, phase -------------------------------------

TEST_P(VecArith, SquareRootAndLogarithmMarkSpecialElements) {
    const Api& z = this->z();
    std::vector<float> v = {4.0f, -0.0f, 0.0f, 2.0f, kInf, 1e-40f};
    ASSERT_EQ(z.zorsSqrt_32f_I(v.data(), 6), StatusOk);
    EXPECT_TRUE(bitsEqual(v, {2.0f, -0.0f, 0.0f, std::sqrt(2.0f), kInf, std::sqrt(1e-40f)}, v));
    for (int at : {0, 3, 4, 9, 12}) {
        std::vector<float> w(13, 9.0f);
        w[at] = at % 2 ? kNaN : -1.0f;
        ASSERT_EQ(z.zorsSqrt_32f_I(w.data(), 13), StatusWarnSqrtNegative) << at;
        for (int i = 0; i < 13; ++i) EXPECT_EQ(bitsOf(w[i]), i == at ? kNegNaN : bitsOf(3.0f)) << at;
    }
    // The logarithm reports the first special element; -0 and negative NaNs
    // count as negative; NaNs otherwise pass quieted.
    for (int at : {0, 5, 7, 8, 11}) {
        std::vector<float> w(12, 2.0f);
        w[at] = -0.0f;
        w[(at + 3) % 12] = 0.0f;
        EXPECT_EQ(z.zorsLn_32f_I(w.data(), 12), at < (at + 3) % 12 ? StatusWarnLnNegative : StatusWarnLnZero) << at;
        EXPECT_EQ(bitsOf(w[at]), kNegNaN);
        EXPECT_EQ(w[(at + 3) % 12], -kInf);
    }
    std::vector<float> q = {floatOf(0x7FC01234u), floatOf(0x7F800001u), kInf, 1.0f, floatOf(0xFFC01234u)};
    EXPECT_EQ(z.zorsLn_32f_I(q.data(), 4), StatusOk);
    EXPECT_EQ(bitsOf(q[0]), 0x7FC01234u);
    EXPECT_EQ(bitsOf(q[1]), 0x7FC00001u);
    EXPECT_EQ(q[2], kInf);
    EXPECT_EQ(bitsOf(q[3]), 0u);
    EXPECT_EQ(z.zorsLn_32f_I(q.data() + 4, 1), StatusWarnLnNegative);
    EXPECT_EQ(bitsOf(q[4]), kNegNaN);
}

namespace {
// The double result rounded to double (a volatile store: the x87 unit may
// return more) and then once to float.
float roundedLog(float x) {
    volatile double d = std::log(static_cast<double>(x));
    return static_cast<float>(d);
}
float roundedAtan2(float y, float x) {
    volatile double d = std::atan2(static_cast<double>(y), static_cast<double>(x));
    return static_cast<float>(d);
}

#if defined(_WIN32)
constexpr int kSweep = 1 << 16;  // emulated: keep the suite quick
#else
constexpr int kSweep = 1 << 20;
#endif
}  // namespace

// Against the library's double logarithm rounded to float, bit for bit, over
// random bit patterns of every positive float and the places where the
// approximation changes table row (mantissa low bits around 0x4000), powers
// of two, the neighbourhood of 1 and the ends of the range.
TEST_P(VecArith, LogarithmMatchesRoundedLibraryOverManyInputs) {
    const Api& z = this->z();
    std::vector<float> src;
    std::mt19937 rng(2024);
    std::uniform_int_distribution<uint32_t> any(1, 0x7F7FFFFF);
    for (int i = 0; i < kSweep; ++i) src.push_back(floatOf(any(rng)));
    for (uint32_t e : {1u, 60u, 125u, 126u, 127u, 128u, 200u, 254u})
        for (uint32_t k = 0; k < 256; ++k)
            for (int j = -2; j <= 2; ++j) src.push_back(floatOf((e << 23) | (k << 15) | uint32_t(0x4000 + j)));
    for (uint32_t e = 1; e < 255; ++e)
        for (int j = -3; j <= 3; ++j) src.push_back(floatOf((e << 23) + uint32_t(j)));
    for (int j = 1; j <= 40000; ++j) {
        src.push_back(floatOf(0x3F800000u + uint32_t(j)));
        src.push_back(floatOf(0x3F800000u - uint32_t(j)));
    }
    src.push_back(floatOf(0x7F7FFFFFu));
    src.push_back(floatOf(1u));
    // Logarithms within a few dozen double ulps of a float rounding midpoint
    // (where the fast approximation must defer to the library), and the one
    // float whose logarithm the approximation alone would round wrongly.
    for (uint32_t u : {0x01b5b6ffu, 0x01f100d0u, 0x022ae487u, 0x02ae0decu, 0x02c7a933u, 0x031c2829u,
                       0x039656e7u, 0x03b0ffa6u, 0x03d2f29fu, 0x03f22eecu, 0x04294560u, 0x04366d72u,
                       0x65d890d3u})
        for (int rep = 0; rep < 4; ++rep) src.insert(src.begin() + 4 * rep + 1, floatOf(u));
    std::vector<float> want(src.size());
    for (size_t i = 0; i < src.size(); ++i) want[i] = roundedLog(src[i]);
    std::vector<float> got = src;
    ASSERT_EQ(z.zorsLn_32f_I(got.data(), static_cast<int>(got.size())), StatusOk);
    EXPECT_TRUE(bitsEqual(got, want, src));
}

// Against the library's double atan2 rounded to float, bit for bit: random
// bit patterns (zeros, infinities and NaNs included), magnitudes within
// 2^+-60 of each other in every quadrant, ratios next to the table points
// k/64 (and next to 1, where the octants meet), small integers, and the
// quadrant boundaries.
TEST_P(VecArith, PhaseMatchesRoundedLibraryOverManyInputs) {
    const Api& z = this->z();
    std::mt19937_64 rng(99);
    const int n = kSweep / 2;
    std::vector<float> y(n), x(n);
    for (int i = 0; i < n; ++i) {
        const uint64_t b = rng();
        switch (i % 4) {
            case 0:
                y[i] = floatOf(uint32_t(b));
                x[i] = floatOf(uint32_t(b >> 32));
                break;
            case 1:
                y[i] = floatOf((uint32_t(b) & 0x807FFFFFu) | (uint32_t(97 + (b >> 24) % 60) << 23));
                x[i] = floatOf((uint32_t(b >> 32) & 0x807FFFFFu) | (uint32_t(97 + (b >> 56) % 60) << 23));
                break;
            case 2: {
                const float m = floatOf((uint32_t(b) & 0x007FFFFFu) | (uint32_t(110 + (b >> 24) % 40) << 23));
                const float t = float((b >> 32) % 65) / 64.0f + float(int((b >> 40) % 2001) - 1000) * 0x1p-30f;
                y[i] = m * t * ((b >> 60) & 1 ? -1.0f : 1.0f);
                x[i] = (b >> 61) & 1 ? -m : m;
                if ((b >> 62) & 1) std::swap(y[i], x[i]);
                break;
            }
            default:
                y[i] = float(int(b % 2001) - 1000);
                x[i] = float(int((b >> 20) % 2001) - 1000);
        }
    }
    // Pairs whose atan2 lies within a few hundred double ulps of a float
    // rounding midpoint, in every lane position; then signed zeros and
    // infinities against each other.
    const uint32_t hard[][2] = {{0x35d1e46f, 0xbfcb1f45}, {0xbf89d3ac, 0x329300c5}, {0x36c2cff3, 0x4b42ea0b},
                                {0x479a92e3, 0x3e55d3b3}, {0x4b63aab7, 0xc15fdf6b}, {0xb6108402, 0xbeb7ffb1},
                                {0x467d87d0, 0x48b569af}, {0xb9c38785, 0xb5dffcb2}, {0xb9d18983, 0x336b8d4d},
                                {0xb2fdd19e, 0x36c9fe93}, {0xb719abcf, 0xc20797ec}, {0x4b4e6eaa, 0x3e5c2cff}};
    int at = 5;
    for (const auto& h : hard) {
        y[at] = floatOf(h[0]);
        x[at] = floatOf(h[1]);
        at += 9;
    }
    const float edge[] = {0.0f, -0.0f, 1.0f, -1.0f, kInf, -kInf};
    for (float a : edge)
        for (float b : edge) {
            y[at] = a;
            x[at++] = b;
        }
    std::vector<float> want(n), got(n), a21(n);
    for (int i = 0; i < n; ++i) want[i] = roundedAtan2(y[i], x[i]);
    ASSERT_EQ(z.zorsPhase_32f(x.data(), y.data(), got.data(), n), StatusOk);
    ASSERT_EQ(z.zorsAtan2_32f_A21(y.data(), x.data(), a21.data(), n), StatusOk);
    // NaN results: any NaN will do.
    for (int i = 0; i < n; ++i)
        if (want[i] != want[i]) {
            EXPECT_TRUE(got[i] != got[i] && a21[i] != a21[i]);
            got[i] = a21[i] = want[i];
        }
    EXPECT_TRUE(bitsEqual(got, want, y, &x));
    EXPECT_TRUE(bitsEqual(a21, want, y, &x));
}

TEST_P(VecArith, MagnitudePowerAndNormalizeInDouble) {
    const Api& z = this->z();
    const float re[4] = {3, -5, 1e30f, 1e-30f}, im[4] = {4, 12, 1e30f, 0};
    float d[4];
    ASSERT_EQ(z.zorsMagnitude_32f(re, im, d, 4), StatusOk);
    EXPECT_EQ(d[0], 5.0f);
    EXPECT_EQ(d[1], 13.0f);
    EXPECT_EQ(d[2], static_cast<float>(std::sqrt(2.0) * double(1e30f)));  // no overflow in double
    EXPECT_EQ(d[3], 1e-30f);                                                // no underflow either
    const Complex32f c[4] = {{3, 4}, {-5, 12}, {1e30f, 1e30f}, {1e-30f, 0}};
    float dc[4];
    ASSERT_EQ(z.zorsMagnitude_32fc(c, dc, 4), StatusOk);
    for (int i = 0; i < 4; ++i) EXPECT_EQ(bitsOf(dc[i]), bitsOf(d[i]));

    // re^2 + im^2 rounded once: (1 + 2^-12)^2 + 2^-52 lies just above a float
    // midpoint and rounds up; float arithmetic would round re^2 to even first
    // and lose the 2^-52.
    const float r1[1] = {1.0f + 0x1p-12f}, i1[1] = {0x1p-26f};
    float ps;
    ASSERT_EQ(z.zorsPowerSpectr_32f(r1, i1, &ps, 1), StatusOk);
    EXPECT_EQ(ps, 1.0f + 0x1p-11f + 0x1p-23f);

    // (x - sub) * (1/div) with the reciprocal in double.
    const float xs[2] = {1.0f, 3.0f};
    float nd[2];
    ASSERT_EQ(z.zorsNormalize_32f(xs, nd, 2, 1.0f, 3.0f), StatusOk);
    EXPECT_EQ(nd[0], 0.0f);
    EXPECT_EQ(nd[1], static_cast<float>(2.0 * (1.0 / 3.0)));
}

// ---- sort and deinterleave ------------------------------------------------------------

TEST_P(VecArith, SortsDescending) {
    const Api& z = this->z();
    std::mt19937 rng(9);
    for (int n : {1, 2, 9, 10, 11, 100, 65536}) {
        for (int kind = 0; kind < 4; ++kind) {
            std::vector<float> v(n);
            for (int i = 0; i < n; ++i)
                v[i] = kind == 0 ? float(int(rng() % 2000001) - 1000000) : kind == 1 ? float(int(rng() % 7) - 3)
                                                                          : kind == 2 ? float(i) : float(-i);
            std::vector<float> want = v;
            std::sort(want.begin(), want.end(), [](float a, float b) { return a > b; });
            ASSERT_EQ(z.zorsSortDescend_32f_I(v.data(), n), StatusOk);
            ASSERT_EQ(v, want) << "n=" << n << " kind=" << kind;
        }
    }
    // NaNs leave some order, but stay inside the vector and keep the count.
    std::vector<float> w = zt::randomFloats(3001, 4, 1000.0f, true);
    const auto nans = [](const std::vector<float>& u) { return std::count_if(u.begin(), u.end(), [](float f) { return f != f; }); };
    const auto before = nans(w);
    ASSERT_EQ(z.zorsSortDescend_32f_I(w.data(), 3001), StatusOk);
    EXPECT_EQ(nans(w), before);
}

TEST_P(VecArith, DeinterleaveSplitsChannelsAndWarnsOnAlignment) {
    const Api& z = this->z();
    const int len = 37, stride = 48;  // planes 96 bytes apart: aligned like the block
    int16_t* src = zorsMalloc_16s(5 * len + 8);
    int16_t* mem = zorsMalloc_16s(5 * stride);
    for (int i = 0; i < 5 * len + 8; ++i) src[i] = static_cast<int16_t>(i * 977 - 30000);
    // Aligned: OK; a source or a destination off 16 bytes: done and warned.
    for (int ch : {1, 2, 3, 5}) {
        for (int shift : {0, 1, 2}) {
            std::memset(mem, 0, 5 * stride * sizeof(int16_t));
            int16_t* planes[5];
            for (int c = 0; c < ch; ++c) planes[c] = mem + c * stride + (shift == 2 && c == ch - 1 ? 4 : 0);
            const int16_t* s = src + (shift == 1);
            EXPECT_EQ(z.zorsDeinterleave_16s(s, ch, len, planes), shift ? StatusWarnMisaligned : StatusOk);
            for (int c = 0; c < ch; ++c)
                for (int i = 0; i < len; ++i) ASSERT_EQ(planes[c][i], s[i * ch + c]) << ch << " " << shift;
        }
    }
    zorsFree(src);
    zorsFree(mem);
    zt::agreesWithGeneric(variant(), [](const Api& z, Case& c) {
        const int n = c.len(), ch = 2 + c.index() % 2;  // the paired path and the general one
        int16_t* planes[3] = {c.out<int16_t>(n), c.out<int16_t>(n), c.out<int16_t>(n)};
        return z.zorsDeinterleave_16s(c.in<int16_t>(n * ch), ch, n, planes);
    });
}

ZT_ALL_VARIANTS(VecArith);
