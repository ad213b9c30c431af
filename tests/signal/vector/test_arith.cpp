// Vector arithmetic and elementwise math against their definitions (float
// arithmetic rounded once, exact integers, the library's double functions
// rounded to float), pinned special values, check order, and every variant
// against the generic one.
#include <algorithm>
#include <cmath>
#include <functional>
#include <limits>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class VecArith : public zt::VariantTest {};
using zt::Api, zt::Case;

float floatOf(uint32_t u) { float x; std::memcpy(&x, &u, 4); return x; }
const float kInf = std::numeric_limits<float>::infinity(), kNaN = std::numeric_limits<float>::quiet_NaN();
const float kNegNaN = floatOf(0xFFC00000u);  // what square root and logarithm leave for negatives

// call(d) on d (holding start) returns status and leaves want in d, bit for bit.
template <class T, class Call>
void expectValues(std::vector<T> d, Call call, const std::vector<T>& want, Status status = StatusOk) {
    ASSERT_EQ(call(d.data()), status);
    for (size_t i = 0; i < d.size(); ++i)
        ASSERT_TRUE(zt::sameBits(d[i], want[i])) << std::hexfloat << "element " << i << ": " << d[i] << ", want " << want[i];
}
// The same with element i expected as want(i).
template <class T, class Call, class Want>
void expectEach(const std::vector<T>& start, Call call, Want want, Status status = StatusOk) {
    std::vector<T> w(start.size());
    for (size_t i = 0; i < w.size(); ++i) w[i] = static_cast<T>(want(int(i)));
    expectValues(start, call, w, status);
}

// Pointers, then length argument L, on the valid call fn(a...).
template <size_t L, class... P, class... A>
void lengthChecks(const std::vector<zt::Watch>& w, Status(ZOR_CALL* fn)(P...), A... a) {
    zt::expectChecks(fn, std::tuple<P...>(a...), w, zt::eachNull(), zt::badLength<L>());
}
// Random floats with NaN, infinities, zeros and denormals, for the agreement runs.
float* in(Case& c) { return c.in(c.floats(c.len())); }
float* inOut(Case& c) { return c.inOut(c.floats(c.len())); }

}  // namespace

TEST_P(VecArith, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    float f[16] = {1, 2, 3, 4, 5, 6, 7, 8}, d[8] = {};
    int16_t s[8] = {1, 2, 3}, t[8] = {}, *planes[2] = {t, t + 4}, *oneNull[2] = {t, nullptr};
    double x[8] = {1}, y[8] = {};
    const std::vector<zt::Watch> wf{zt::watch(d, sizeof d)}, ws{zt::watch(t, sizeof t)}, wd{zt::watch(y, sizeof y)};
    for (auto fn : {z.zorsAdd_32f, z.zorsMagnitude_32f, z.zorsPowerSpectr_32f, z.zorsPhase_32f}) lengthChecks<3>(wf, fn, f, f, d, 8);
    for (auto fn : {z.zorsAdd_32f_I, z.zorsSub_32f_I, z.zorsMul_32f_I, z.zorsDiv_32f_I, z.zorsAbs_32f, z.zorsSqr_32f})
        lengthChecks<2>(wf, fn, f, d, 8);
    for (auto fn : {z.zorsAddC_32f_I, z.zorsSubC_32f_I, z.zorsMulC_32f_I, z.zorsDivC_32f_I}) lengthChecks<2>(wf, fn, 2.0f, d, 8);
    for (auto fn : {z.zorsSubC_32f, z.zorsMulC_32f, z.zorsDivC_32f}) lengthChecks<3>(wf, fn, f, 2.0f, d, 8);
    for (auto fn : {z.zorsAbs_32f_I, z.zorsSqr_32f_I, z.zorsSqrt_32f_I, z.zorsLn_32f_I, z.zorsSortDescend_32f_I})
        lengthChecks<1>(wf, fn, d, 8);
    lengthChecks<1>(wf, z.zorsThreshold_32f_I, d, 8, 1.0f, int(CmpGreater));
    lengthChecks<2>(wf, z.zorsThreshold_LTVal_32f, f, d, 8, 1.0f, 2.0f);
    lengthChecks<1>(wf, z.zorsThreshold_LTVal_32f_I, d, 8, 1.0f, 2.0f);
    lengthChecks<2>(wf, z.zorsMagnitude_32fc, reinterpret_cast<const Complex32f*>(f), d, 8);
    lengthChecks<3>(ws, z.zorsAdd_16s_Sfs, s, s, t, 8, 0);
    for (auto fn : {z.zorsAddC_16s_I, z.zorsSubC_16s_I}) lengthChecks<2>(ws, fn, int16_t(3), t, 8);
    lengthChecks<2>(ws, z.zorsAbs_16s, s, t, 8);
    lengthChecks<1>(ws, z.zorsAbs_16s_I, t, 8);
    lengthChecks<2>(wd, z.zorsAbs_64f, x, y, 8);
    lengthChecks<1>(wd, z.zorsAbs_64f_I, y, 8);
    // The order: pointers, length, then the export's own arguments.
    zt::expectChecks(z.zorsDivC_32f, {f, 2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<1>(0.0f)),
                     zt::bad(StatusDivideByZero, zt::arg<1>(-0.0f)), zt::bad(StatusDivideByZero, zt::arg<1>(kNaN)),
                     zt::bad(StatusBadSize, zt::arg<1>(0.0f), zt::arg<3>(0)));
    zt::expectChecks(z.zorsDivC_32f_I, {2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<0>(kNaN)),
                     zt::bad(StatusNullPointer, zt::arg<0>(0.0f), zt::arg<1>(nullptr)));
    // Divisors below the smallest normal are refused; that one is accepted.
    zt::expectChecks(z.zorsNormalize_32f, {f, d, 8, 1.0f, -1.1754943508222875e-38f}, wf, zt::eachNull(),
                     zt::badLength<2>(), zt::bad(StatusDivideByZero, zt::arg<4>(-1e-39f)),
                     zt::bad(StatusDivideByZero, zt::arg<4>(kNaN)), zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<4>(0.0f)));
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
    zt::expectChecks(z.zorsDeinterleave_16s, {s, 2, 4, planes}, ws, zt::eachNull(), zt::bad(StatusBadChannelCount, zt::arg<1>(0)),
                     zt::bad(StatusBadSize, zt::arg<2>(0)), zt::bad(StatusNullPointer, zt::arg<3>(oneNull)),
                     zt::bad(StatusBadChannelCount, zt::arg<1>(0), zt::arg<2>(0)), zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<3>(oneNull)));
}

// Every variant against the generic entries: random floats with NaN,
// infinities, zeros and denormals, integers over their whole range.
TEST_P(VecArith, AgreesWithGeneric) {
    const int v = variant();
    for (auto fn : {&Api::zorsAdd_32f, &Api::zorsMagnitude_32f, &Api::zorsPowerSpectr_32f, &Api::zorsPhase_32f,
                    &Api::zorsAtan2_32f_A21})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) { return (z.*fn)(in(c), in(c), c.out<float>(c.len()), c.len()); });
    for (auto fn : {&Api::zorsAdd_32f_I, &Api::zorsSub_32f_I, &Api::zorsMul_32f_I, &Api::zorsDiv_32f_I,
                    &Api::zorsAbs_32f, &Api::zorsSqr_32f})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) { return (z.*fn)(in(c), inOut(c), c.len()); });
    for (auto fn : {&Api::zorsAbs_32f_I, &Api::zorsSqr_32f_I, &Api::zorsSqrt_32f_I, &Api::zorsLn_32f_I})
        zt::agreesWithGeneric(v, [fn](const Api& z, Case& c) { return (z.*fn)(inOut(c), c.len()); });
    for (float k : {0.0f, 1.0f, -3.0f, 1e30f, 7e-3f}) {  // the shortcuts, overflow, an inexact reciprocal
        for (auto fn : {&Api::zorsAddC_32f_I, &Api::zorsSubC_32f_I, &Api::zorsMulC_32f_I, &Api::zorsDivC_32f_I})
            zt::agreesWithGeneric(v, [fn, k](const Api& z, Case& c) { return (z.*fn)(k, inOut(c), c.len()); });
        for (auto fn : {&Api::zorsSubC_32f, &Api::zorsMulC_32f, &Api::zorsDivC_32f})
            zt::agreesWithGeneric(v, [fn, k](const Api& z, Case& c) { return (z.*fn)(in(c), k, c.out<float>(c.len()), c.len()); });
        zt::agreesWithGeneric(v, [k](const Api& z, Case& c) {
            const int n = c.len();
            return z.zorsThreshold_32f_I(inOut(c), n, k, n % 2 ? CmpGreater : CmpLess) +
                   z.zorsThreshold_LTVal_32f(in(c), c.out<float>(n), n, k, -5.0f) + z.zorsThreshold_LTVal_32f_I(inOut(c), n, k, 2.0f) +
                   z.zorsNormalize_32f(in(c), c.out<float>(n), n, 0.3f, k);
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
            const int n = c.len(), nr = std::max(sf, 0);
            const int16_t k = int16_t(c.rng()()), *a = c.in<int16_t>(n);
            return z.zorsAdd_16s_Sfs(a, c.in<int16_t>(n), c.out<int16_t>(n), n, sf) +
                   z.zorsMul_NR_16s_Sfs(a, c.in<int16_t>(n), c.out<int16_t>(n), n, nr) +
                   z.zorsMul_NR_16s_ISfs(a, c.inOut<int16_t>(n), n, nr) + z.zorsMulC_NR_16s_Sfs(a, k, c.out<int16_t>(n), n, nr) +
                   z.zorsMulC_NR_16s_ISfs(int16_t(-32768), c.inOut<int16_t>(n), n, nr) +
                   z.zorsAddC_16s_I(k, c.inOut<int16_t>(n), n) + z.zorsSubC_16s_I(int16_t(-32768), c.inOut<int16_t>(n), n);
        });
}

// ---- float arithmetic -----------------------------------------------------------

// A single float operation rounded once is the double result rounded once.
TEST_P(VecArith, ElementwiseMatchesFloatArithmetic) {
    const Api& z = this->z();
    const int n = 37;
    const auto a = zt::randomFloats(n, 11), b = zt::randomFloats(n, 12, 1e-3f);
    // The export writes d (holding a); op(a[i], b[i]) is element i.
    const auto each = [&](auto call, auto op) { expectEach(a, call, [&](int i) { return op(a[i], b[i]); }); };
    const auto add = [](float x, float y) { return x + y; };
    const auto sqr = [](float x, float) { return x * x; };
    each([&](float* d) { return z.zorsAdd_32f(a.data(), b.data(), d, n); }, add);
    each([&](float* d) { return z.zorsAdd_32f_I(b.data(), d, n); }, add);
    each([&](float* d) { return z.zorsSub_32f_I(b.data(), d, n); }, [](float x, float y) { return x - y; });
    each([&](float* d) { return z.zorsMul_32f_I(b.data(), d, n); }, [](float x, float y) { return x * y; });
    each([&](float* d) { return z.zorsDiv_32f_I(b.data(), d, n); }, [](float x, float y) { return x / y; });
    each([&](float* d) { return z.zorsSqr_32f(a.data(), d, n); }, sqr);
    each([&](float* d) { return z.zorsSqr_32f_I(d, n); }, sqr);
    each([&](float* d) { return z.zorsMulC_32f(a.data(), 3.5f, d, n); }, [](float x, float) { return x * 3.5f; });
    each([&](float* d) { return z.zorsSubC_32f(a.data(), 0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    each([&](float* d) { return z.zorsSubC_32f_I(0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    each([&](float* d) { return z.zorsAddC_32f_I(-7.0f, d, n); }, [](float x, float) { return x + -7.0f; });
    each([&](float* d) { return z.zorsMulC_32f_I(-7.0f, d, n); }, [](float x, float) { return x * -7.0f; });
    // Division by a constant multiplies by the float reciprocal (for 1/3 that
    // differs from division in the last bit of some elements).
    for (float val : {3.0f, -7.0f, 0.1f, 1e-30f}) {
        const volatile float r = 1.0f / val;  // volatile: rounded to float on the x87 unit too
        const auto byReciprocal = [&r](float x, float) { return x * r; };
        each([&](float* d) { return z.zorsDivC_32f(a.data(), val, d, n); }, byReciprocal);
        each([&](float* d) { return z.zorsDivC_32f_I(val, d, n); }, byReciprocal);
    }
    const float zero[2] = {0, 0};  // IEEE division by zero, no status
    expectValues<float>({1, -1}, [&](float* d) { return z.zorsDiv_32f_I(zero, d, 2); }, {kInf, -kInf});

    // Multiplying by 1, subtracting -0 and dividing by 1 copy, even a
    // signalling NaN; multiplying by 0 and dividing by infinity zero
    // everything, without -0.  In-place subtraction of a constant has no
    // shortcut: -0 - 0 is -0 and the signalling NaN quiets.
    const std::vector<float> src = {floatOf(0x7F800001u), kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f}, zeros(9);
    const std::vector<float> blank(9, 7.0f);
    expectValues(blank, [&](float* d) { return z.zorsMulC_32f(src.data(), 1.0f, d, 9); }, src);
    expectValues(blank, [&](float* d) { return z.zorsSubC_32f(src.data(), -0.0f, d, 9); }, src);
    expectValues(blank, [&](float* d) { return z.zorsDivC_32f(src.data(), 1.0f, d, 9); }, src);
    expectValues(src, [&](float* d) { return z.zorsMulC_32f_I(1.0f, d, 9) + z.zorsAddC_32f_I(0.0f, d, 9); }, src);
    expectValues(blank, [&](float* d) { return z.zorsMulC_32f(src.data(), 0.0f, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsMulC_32f_I(-0.0f, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsDivC_32f_I(-kInf, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsSubC_32f_I(0.0f, d, 9); },
                 {floatOf(0x7FC00001u), kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f});
}

// Absolute value clears the sign bit; thresholds keep equal elements and
// NaNs, clipping from above for CmpGreater and from below for any other code;
// LTVal replaces what is below the level (and NaN).
TEST_P(VecArith, AbsAndThresholdsSelect) {
    const Api& z = this->z();
    const float qNaN = floatOf(0xFFC00001u);
    const std::vector<float> src = {-0.0f, -kInf, kNaN, qNaN, -2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    const std::vector<float> abs = {0.0f, kInf, kNaN, floatOf(0x7FC00001u), 2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    expectValues(src, [&](float* d) { return z.zorsAbs_32f(src.data(), d, 9); }, abs);
    expectValues(src, [&](float* d) { return z.zorsAbs_32f_I(d, 9); }, abs);
    expectValues(src, [&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, CmpGreater); },
                 {-0.0f, -kInf, kNaN, qNaN, -2.5f, 1.0f, 1.0f, 1.0f, 0.5f});
    for (int rel : {int(CmpLess), 1, 5, -1})
        expectValues(src, [&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, rel); },
                     {1.0f, 1.0f, kNaN, qNaN, 1.0f, 3.0f, 1.0f, 1.0f, 1.0f});
    const std::vector<float> lt = {9.0f, 9.0f, 9.0f, 9.0f, 9.0f, 3.0f, 1.0f, 1.0f, 9.0f};
    expectValues(src, [&](float* d) { return z.zorsThreshold_LTVal_32f(src.data(), d, 9, 1.0f, 9.0f); }, lt);
    expectValues(src, [&](float* d) { return z.zorsThreshold_LTVal_32f_I(d, 9, 1.0f, 9.0f); }, lt);
}

// ---- 16-bit and 64-bit ------------------------------------------------------------

// r 2^-sf rounded to nearest (ties to even, or half up), saturated; exact in double.
int16_t scaled(int64_t r, int sf, bool halfUp) {
    const double v = std::ldexp(double(r), -sf);
    return int16_t(std::clamp(halfUp ? std::floor(v + 0.5) : std::nearbyint(v), -32768.0, 32767.0));
}

TEST_P(VecArith, SixteenBitScalingRoundsAndSaturates) {
    const Api& z = this->z();
    std::mt19937 rng(3);
    const int n = 101;
    std::vector<int16_t> x(n), y(n);  // the extremes and small values (ties) among random ones
    for (int i = 0; i < n; ++i)
        x[i] = int16_t(i % 9 == 0 ? -32768 : i % 9 == 1 ? 32767 : int(rng())), y[i] = int16_t(i % 5 ? int(rng()) : int(rng() % 7) - 3);
    // The export writes d (holding start); op(x[i], y[i]) is element i.
    const auto each = [&](const std::vector<int16_t>& start, auto call, auto op) {
        expectEach(start, call, [&](int i) { return op(x[i], y[i]); });
    };
    for (int sf = -18; sf <= 40; ++sf) {
        SCOPED_TRACE(sf);
        if (sf <= 18)  // the sum: ties to even; from -16 down only the sign survives
            each(x, [&](int16_t* d) { return z.zorsAdd_16s_Sfs(x.data(), y.data(), d, n, sf); },
                 [sf](int a, int b) { return scaled(a + b, sf, false); });
        if (sf < 0) continue;  // the products: half up
        const auto product = [sf](int a, int b) { return scaled(int64_t(a) * b, sf, true); };
        const auto byMin = [sf](int a, int) { return scaled(int64_t(a) * -32768, sf, true); };
        each(x, [&](int16_t* d) { return z.zorsMul_NR_16s_Sfs(x.data(), y.data(), d, n, sf); }, product);
        each(y, [&](int16_t* d) { return z.zorsMul_NR_16s_ISfs(x.data(), d, n, sf); }, product);
        each(y, [&](int16_t* d) { return z.zorsMulC_NR_16s_Sfs(x.data(), -32768, d, n, sf); }, byMin);
        each(x, [&](int16_t* d) { return z.zorsMulC_NR_16s_ISfs(-32768, d, n, sf); }, byMin);
    }
    // Constants saturate (and 0 leaves the vector alone); |-32768| is 32767.
    for (int c : {-32768, -1000, 0, 1, 32767}) {
        each(x, [&](int16_t* d) { return z.zorsAddC_16s_I(int16_t(c), d, n); }, [c](int a, int) { return std::clamp(a + c, -32768, 32767); });
        each(x, [&](int16_t* d) { return z.zorsSubC_16s_I(int16_t(c), d, n); }, [c](int a, int) { return std::clamp(a - c, -32768, 32767); });
    }
    const auto abs = [](int a, int) { return std::min(32767, std::abs(a)); };
    each(y, [&](int16_t* d) { return z.zorsAbs_16s(x.data(), d, n); }, abs);
    each(x, [&](int16_t* d) { return z.zorsAbs_16s_I(d, n); }, abs);

    const double dNaN = std::numeric_limits<double>::quiet_NaN();
    const std::vector<double> ds = {-0.0, -1.5, -dNaN, -1e300, 2.0}, dAbs = {0.0, 1.5, dNaN, 1e300, 2.0};
    expectValues(std::vector<double>(5), [&](double* d) { return z.zorsAbs_64f(ds.data(), d, 5); }, dAbs);
    expectValues(ds, [&](double* d) { return z.zorsAbs_64f_I(d, 5); }, dAbs);
}

// ---- square root, logarithm, magnitude, phase -------------------------------------

TEST_P(VecArith, SquareRootAndLogarithmMarkSpecialElements) {
    const Api& z = this->z();
    expectValues<float>({4.0f, -0.0f, 0.0f, 2.0f, kInf, 1e-40f}, [&](float* d) { return z.zorsSqrt_32f_I(d, 6); },
                        {2.0f, -0.0f, 0.0f, std::sqrt(2.0f), kInf, std::sqrt(1e-40f)});
    for (int at : {0, 3, 4, 9, 12}) {  // negative or NaN: the quiet NaN 0xFFC00000 and a warning
        std::vector<float> w(13, 9.0f);
        w[at] = at % 2 ? kNaN : -1.0f;
        expectEach(w, [&](float* d) { return z.zorsSqrt_32f_I(d, 13); }, [at](int i) { return i == at ? kNegNaN : 3.0f; },
                   StatusWarnSqrtNegative);
    }
    // The logarithm reports the first special element; -0 and negative NaNs
    // count as negative; NaNs otherwise pass quieted.
    for (int at : {0, 5, 7, 8, 11}) {
        std::vector<float> w(12, 2.0f);
        w[at] = -0.0f;
        w[(at + 3) % 12] = 0.0f;
        EXPECT_EQ(z.zorsLn_32f_I(w.data(), 12), at < (at + 3) % 12 ? StatusWarnLnNegative : StatusWarnLnZero) << at;
        EXPECT_TRUE(zt::sameBits(w[at], kNegNaN) && w[(at + 3) % 12] == -kInf) << at;
    }
    const std::vector<float> q = {floatOf(0x7FC01234u), floatOf(0x7F800001u), kInf, 1.0f};
    expectValues(q, [&](float* d) { return z.zorsLn_32f_I(d, 4); }, {q[0], floatOf(0x7FC00001u), kInf, 0.0f});
    expectValues<float>({floatOf(0xFFC01234u)}, [&](float* d) { return z.zorsLn_32f_I(d, 1); }, {kNegNaN}, StatusWarnLnNegative);
}

namespace {
// The double result rounded to double (a volatile store: the x87 unit may
// return more) and then once to float.
float roundedLog(float x) { volatile double d = std::log(double(x)); return float(d); }
float roundedAtan2(float y, float x) { volatile double d = std::atan2(double(y), double(x)); return float(d); }

constexpr int kSweep = sizeof(void*) == 4 ? 1 << 16 : 1 << 20;  // the 32-bit build runs emulated: keep it quick
}  // namespace

// Against the library's double logarithm rounded to float, bit for bit, over
// random bit patterns of every positive float and the places where the
// approximation changes table row (mantissa low bits around 0x4000), powers
// of two, the neighbourhood of 1 and the ends of the range.
TEST_P(VecArith, LogarithmMatchesRoundedLibraryOverManyInputs) {
    const Api& z = this->z();
    std::vector<float> src;
    std::mt19937 rng(2024);
    for (int i = 0; i < kSweep; ++i) src.push_back(floatOf(1 + rng() % 0x7F7FFFFFu));
    for (uint32_t e : {1u, 60u, 125u, 126u, 127u, 128u, 200u, 254u})
        for (uint32_t k = 0; k < 256; ++k)
            for (int j = -2; j <= 2; ++j) src.push_back(floatOf((e << 23) | (k << 15) | uint32_t(0x4000 + j)));
    for (uint32_t e = 1; e < 255; ++e)
        for (int j = -3; j <= 3; ++j) src.push_back(floatOf((e << 23) + uint32_t(j)));
    for (int j = -40000; j <= 40000; ++j) src.push_back(floatOf(0x3F800000u + uint32_t(j)));
    // The ends of the range; logarithms within a few dozen double ulps of a
    // float rounding midpoint (where the fast approximation must defer to the
    // library), and the one float whose logarithm the approximation alone
    // would round wrongly: each in several lane positions.
    for (uint32_t u : {1u, 0x7F7FFFFFu, 0x01b5b6ffu, 0x01f100d0u, 0x022ae487u, 0x02ae0decu, 0x02c7a933u, 0x031c2829u,
                       0x039656e7u, 0x03b0ffa6u, 0x03d2f29fu, 0x03f22eecu, 0x04294560u, 0x04366d72u, 0x65d890d3u})
        for (int rep = 0; rep < 4; ++rep) src.insert(src.begin() + 4 * rep + 1, floatOf(u));
    expectEach(src, [&](float* d) { return z.zorsLn_32f_I(d, int(src.size())); }, [&](int i) { return roundedLog(src[i]); });
}

// Against the library's double atan2 rounded to float, bit for bit: random
// bit patterns (zeros, infinities and NaNs included), magnitudes within
// 2^+-60 of each other in every quadrant, ratios next to the table points
// k/64 (and next to 1, where the octants meet), and the quadrant boundaries.
TEST_P(VecArith, PhaseMatchesRoundedLibraryOverManyInputs) {
    const Api& z = this->z();
    std::mt19937_64 rng(99);
    const int n = kSweep / 2;
    std::vector<float> y(n), x(n);
    for (int i = 0; i < n; ++i) {
        const uint64_t b = rng();
        const uint32_t lo = uint32_t(b), hi = uint32_t(b >> 32);
        if (i % 3 == 0) {
            y[i] = floatOf(lo), x[i] = floatOf(hi);
        } else if (i % 3 == 1) {
            y[i] = floatOf((lo & 0x807FFFFFu) | (uint32_t(97 + (b >> 24) % 60) << 23));
            x[i] = floatOf((hi & 0x807FFFFFu) | (uint32_t(97 + (b >> 56) % 60) << 23));
        } else {
            const float m = floatOf((lo & 0x007FFFFFu) | (uint32_t(110 + (b >> 24) % 40) << 23));
            const float t = float(hi % 65) / 64.0f + float(int((b >> 40) % 2001) - 1000) * 0x1p-30f;
            y[i] = m * t * ((b >> 60) & 1 ? -1.0f : 1.0f);
            x[i] = (b >> 61) & 1 ? -m : m;
            if ((b >> 62) & 1) std::swap(y[i], x[i]);
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
    for (const auto& h : hard) y[at] = floatOf(h[0]), x[at] = floatOf(h[1]), at += 9;
    const float edge[] = {0.0f, -0.0f, 1.0f, -1.0f, kInf, -kInf};
    for (float a : edge)
        for (float b : edge) y[at] = a, x[at++] = b;
    // NaN results: any NaN will do.
    const auto nanless = [n](Status s, float* d) { std::replace_if(d, d + n, [](float v) { return v != v; }, kNaN); return s; };
    std::vector<float> want(n);
    for (int i = 0; i < n; ++i) want[i] = roundedAtan2(y[i], x[i]);
    nanless(StatusOk, want.data());
    const std::vector<float> blank(n, 9.0f);
    expectValues(blank, [&](float* d) { return nanless(z.zorsPhase_32f(x.data(), y.data(), d, n), d); }, want);
    expectValues(blank, [&](float* d) { return nanless(z.zorsAtan2_32f_A21(y.data(), x.data(), d, n), d); }, want);
}

TEST_P(VecArith, MagnitudePowerAndNormalizeInDouble) {
    const Api& z = this->z();
    // Squares summed in double: no overflow, no underflow.
    const std::vector<float> re = {3, -5, 1e30f, 1e-30f}, im = {4, 12, 1e30f, 0};
    const std::vector<float> mag = {5.0f, 13.0f, static_cast<float>(std::sqrt(2.0) * double(1e30f)), 1e-30f};
    const Complex32f c[4] = {{3, 4}, {-5, 12}, {1e30f, 1e30f}, {1e-30f, 0}};
    expectValues(re, [&](float* d) { return z.zorsMagnitude_32f(re.data(), im.data(), d, 4); }, mag);
    expectValues(re, [&](float* d) { return z.zorsMagnitude_32fc(c, d, 4); }, mag);
    // re^2 + im^2 rounded once: (1 + 2^-12)^2 + 2^-52 lies just above a float
    // midpoint and rounds up; float arithmetic would round re^2 to even first
    // and lose the 2^-52.
    const float r1[1] = {1.0f + 0x1p-12f}, i1[1] = {0x1p-26f};
    expectValues<float>({0}, [&](float* d) { return z.zorsPowerSpectr_32f(r1, i1, d, 1); }, {1.0f + 0x1p-11f + 0x1p-23f});
    // (x - sub) * (1/div) with the reciprocal in double.
    const float xs[2] = {1.0f, 3.0f};
    expectValues<float>({0, 0}, [&](float* d) { return z.zorsNormalize_32f(xs, d, 2, 1.0f, 3.0f); },
                        {0.0f, static_cast<float>(2.0 * (1.0 / 3.0))});
}

// ---- sort and deinterleave ------------------------------------------------------------

TEST_P(VecArith, SortsDescending) {
    const Api& z = this->z();
    std::mt19937 rng(9);
    for (int n : {1, 2, 9, 10, 11, 100, 65536})
        for (int kind = 0; kind < 4; ++kind) {  // random, few distinct values, ascending, descending
            std::vector<float> v(n);
            for (int i = 0; i < n; ++i)
                v[i] = kind == 0 ? float(int(rng() % 2000001) - 1000000) : kind == 1 ? float(int(rng() % 7) - 3)
                                                                          : float(kind == 2 ? i : -i);
            std::vector<float> want = v;
            std::sort(want.begin(), want.end(), std::greater<float>());
            expectValues(v, [&](float* d) { return z.zorsSortDescend_32f_I(d, n); }, want);
        }
    // NaNs leave some order, but stay inside the vector and keep the count.
    std::vector<float> w = zt::randomFloats(3001, 4, 1000.0f, true);
    const auto nans = [&w] { return std::count_if(w.begin(), w.end(), [](float f) { return f != f; }); };
    const auto before = nans();
    EXPECT_TRUE(z.zorsSortDescend_32f_I(w.data(), 3001) == StatusOk && nans() == before);
}

TEST_P(VecArith, DeinterleaveSplitsChannelsAndWarnsOnAlignment) {
    const Api& z = this->z();
    const int len = 37, stride = 48;  // planes 96 bytes apart: aligned like the block
    int16_t *src = zorsMalloc_16s(5 * len + 8), *mem = zorsMalloc_16s(5 * stride), *planes[5];
    for (int i = 0; i < 5 * len + 8; ++i) src[i] = static_cast<int16_t>(i * 977 - 30000);
    // Aligned: OK; a source or a destination off 16 bytes: done and warned.
    for (int ch : {1, 2, 3, 5})
        for (int shift : {0, 1, 2}) {
            for (int c = 0; c < ch; ++c) planes[c] = mem + c * stride + (shift == 2 && c == ch - 1 ? 4 : 0);
            const int16_t* s = src + (shift == 1);
            EXPECT_EQ(z.zorsDeinterleave_16s(s, ch, len, planes), shift ? StatusWarnMisaligned : StatusOk);
            for (int c = 0; c < ch; ++c)
                for (int i = 0; i < len; ++i) ASSERT_EQ(planes[c][i], s[i * ch + c]) << ch << " " << shift;
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
