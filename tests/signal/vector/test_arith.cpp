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

struct VecArith : zt::VariantTest {
    const zt::Api& z = zt::api(GetParam());  // this variant's entries
};
using zt::Api, zt::Case;

float floatOf(uint32_t u) { float x; std::memcpy(&x, &u, 4); return x; }
const float kInf = std::numeric_limits<float>::infinity(), kNaN = std::numeric_limits<float>::quiet_NaN();
const float kNegNaN = floatOf(0xFFC00000u);  // what square root and logarithm leave for negatives

// call(d) on d (holding start) returns status and leaves want in d, bit for
// bit (where anyNaN is set, any NaN where a NaN is wanted).
template <class T, class Call>
void expectValues(std::vector<T> d, Call call, const std::vector<T>& want, Status status = StatusOk, bool anyNaN = false) {
    ASSERT_EQ(call(d.data()), status);
    for (size_t i = 0; i < d.size(); ++i)
        ASSERT_TRUE(zt::sameBits(d[i], want[i]) || (anyNaN && d[i] != d[i] && want[i] != want[i]))
            << std::hexfloat << "element " << i << ": " << d[i] << ", want " << want[i];
}
// The same with element i expected as want(i).
template <class T, class Call, class Want>
void expectEach(const std::vector<T>& start, Call call, Want want, Status status = StatusOk, bool anyNaN = false) {
    std::vector<T> w(start.size());
    for (size_t i = 0; i < w.size(); ++i) w[i] = static_cast<T>(want(int(i)));
    expectValues(start, call, w, status, anyNaN);
}

// Pointers, length argument L, then the rows of the export's own arguments.
template <size_t L, class... P, class... Rows>
void lengthChecks(Status(ZOR_CALL* fn)(P...), typename zt::Same<std::tuple<P...>>::type good,
                  const std::vector<zt::Watch>& w, const Rows&... rows) {
    zt::expectChecks(fn, good, w, zt::eachNull(), zt::badLength<L>(), rows...);
}
// Random floats with NaN, infinities, zeros and denormals, for the agreement runs.
float* in(Case& c) { return c.in(c.floats(c.len())); }
float* inOut(Case& c) { return c.inOut(c.floats(c.len())); }
float* out(Case& c) { return c.out<float>(c.len()); }

// The double result rounded to double (a volatile store: the x87 unit may
// return more) and then once to float.
float roundedLog(float x) { volatile double d = std::log(double(x)); return float(d); }
float roundedAtan2(float y, float x) { volatile double d = std::atan2(double(y), double(x)); return float(d); }
constexpr int kSweep = sizeof(void*) == 4 ? 1 << 16 : 1 << 20;  // the 32-bit build runs emulated: keep it quick

// v saturated to 16 bits; r 2^-sf (exact in double) rounded to nearest, ties
// to even or half up, and saturated.
int sat16(double v) { return int(std::clamp(v, -32768.0, 32767.0)); }
int tiesToEven(int64_t r, int sf) { return sat16(std::nearbyint(std::ldexp(double(r), -sf))); }
int halfUp(int64_t r, int sf) { return sat16(std::floor(std::ldexp(double(r), -sf) + 0.5)); }

}  // namespace

TEST_P(VecArith, ChecksComeInOrderAndWriteNothing) {
    float f[16] = {1, 2, 3, 4, 5, 6, 7, 8}, d[8] = {};
    int16_t s[8] = {1, 2, 3}, t[8] = {}, *planes[2] = {t, t + 4}, *oneNull[2] = {t, nullptr};
    const std::vector<zt::Watch> wf{zt::watch(d, sizeof d)}, ws{zt::watch(t, sizeof t)};
    // Each export that checks its arguments itself; the plain elementwise
    // ones (abs, square, the vector-vector operations, LTVal) share one
    // check, seen through zorsAdd_32f.
    for (auto fn : {z.zorsAdd_32f, z.zorsMagnitude_32f, z.zorsPowerSpectr_32f, z.zorsPhase_32f})
        lengthChecks<3>(fn, {f, f, d, 8}, wf);
    for (auto fn : {z.zorsAddC_32f_I, z.zorsSubC_32f_I, z.zorsMulC_32f_I}) lengthChecks<2>(fn, {2.0f, d, 8}, wf);
    for (auto fn : {z.zorsSubC_32f, z.zorsMulC_32f}) lengthChecks<3>(fn, {f, 2.0f, d, 8}, wf);
    for (auto fn : {z.zorsSqrt_32f_I, z.zorsLn_32f_I, z.zorsSortDescend_32f_I}) lengthChecks<1>(fn, {d, 8}, wf);
    lengthChecks<1>(z.zorsThreshold_32f_I, {d, 8, 1.0f, CmpGreater}, wf);
    lengthChecks<2>(z.zorsMagnitude_32fc, {reinterpret_cast<const Complex32f*>(f), d, 8}, wf);
    lengthChecks<3>(z.zorsAdd_16s_Sfs, {s, s, t, 8, 0}, ws);
    for (auto fn : {z.zorsAddC_16s_I, z.zorsSubC_16s_I}) lengthChecks<2>(fn, {3, t, 8}, ws);
    // The order: pointers, length, then the export's own arguments.
    lengthChecks<3>(z.zorsDivC_32f, {f, 2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<1>(-0.0f)),
                    zt::bad(StatusDivideByZero, zt::arg<1>(kNaN)), zt::bad(StatusBadSize, zt::arg<1>(0.0f), zt::arg<3>(0)));
    lengthChecks<2>(z.zorsDivC_32f_I, {2.0f, d, 8}, wf, zt::bad(StatusDivideByZero, zt::arg<0>(kNaN)));
    // Divisors below the smallest normal are refused; that one is accepted.
    lengthChecks<2>(z.zorsNormalize_32f, {f, d, 8, 1.0f, -1.1754943508222875e-38f}, wf,
                    zt::bad(StatusDivideByZero, zt::arg<4>(-1e-39f)), zt::bad(StatusDivideByZero, zt::arg<4>(kNaN)),
                    zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<4>(0.0f)));
    // The _NR members refuse a negative scale factor, after the length.
    lengthChecks<3>(z.zorsMul_NR_16s_Sfs, {s, s, t, 8, 1}, ws, zt::bad(StatusBadScaleFactor, zt::arg<4>(-1)),
                    zt::bad(StatusBadSize, zt::arg<3>(0), zt::arg<4>(-1)));
    lengthChecks<2>(z.zorsMul_NR_16s_ISfs, {s, t, 8, 1}, ws, zt::bad(StatusBadScaleFactor, zt::arg<3>(-5)));
    lengthChecks<3>(z.zorsMulC_NR_16s_Sfs, {s, 3, t, 8, 1}, ws, zt::bad(StatusBadScaleFactor, zt::arg<4>(-1)));
    lengthChecks<2>(z.zorsMulC_NR_16s_ISfs, {3, t, 8, 1}, ws, zt::bad(StatusBadScaleFactor, zt::arg<3>(-1)));
    // The arctangent checks the length before the pointers.
    lengthChecks<3>(z.zorsAtan2_32f_A21, {f, f, d, 8}, wf, zt::bad(StatusBadSize, zt::arg<0>(nullptr), zt::arg<3>(0)));
    // Deinterleave: pointers, channel count, length, then each plane.
    lengthChecks<2>(z.zorsDeinterleave_16s, {s, 2, 4, planes}, ws, zt::bad(StatusBadChannelCount, zt::arg<1>(0)),
                    zt::bad(StatusNullPointer, zt::arg<3>(oneNull)), zt::bad(StatusBadChannelCount, zt::arg<1>(0), zt::arg<2>(0)),
                    zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<3>(oneNull)));
}

// Every variant against the generic entries: random floats with NaN,
// infinities, zeros and denormals.  An export and its in-place twin run the
// same kernel: the in-place one stands for both (and shows that aliasing is
// safe).  The 16-bit exports meet exact integers on these cases instead.
TEST_P(VecArith, AgreesWithGeneric) {
    for (auto fn : {&Api::zorsMagnitude_32f, &Api::zorsPowerSpectr_32f, &Api::zorsPhase_32f, &Api::zorsAtan2_32f_A21})
        zt::agreesWithGeneric(variant(), [fn](const Api& z, Case& c) { return (z.*fn)(in(c), in(c), out(c), c.len()); });
    for (auto fn : {&Api::zorsAdd_32f_I, &Api::zorsSub_32f_I, &Api::zorsMul_32f_I, &Api::zorsDiv_32f_I})
        zt::agreesWithGeneric(variant(), [fn](const Api& z, Case& c) { return (z.*fn)(in(c), inOut(c), c.len()); });
    for (auto fn : {&Api::zorsAbs_32f_I, &Api::zorsSqr_32f_I, &Api::zorsSqrt_32f_I, &Api::zorsLn_32f_I})
        zt::agreesWithGeneric(variant(), [fn](const Api& z, Case& c) { return (z.*fn)(inOut(c), c.len()); });
    for (float k : {0.0f, 1.0f, -3.0f, 1e30f, 7e-3f}) {  // the shortcuts, overflow, an inexact reciprocal
        for (auto fn : {&Api::zorsAddC_32f_I, &Api::zorsSubC_32f_I, &Api::zorsMulC_32f_I, &Api::zorsDivC_32f_I})
            zt::agreesWithGeneric(variant(), [fn, k](const Api& z, Case& c) { return (z.*fn)(k, inOut(c), c.len()); });
        zt::agreesWithGeneric(variant(), [k](const Api& z, Case& c) {
            return z.zorsThreshold_32f_I(inOut(c), c.len(), k, c.len() % 2 ? CmpGreater : CmpLess) +
                   z.zorsThreshold_LTVal_32f_I(inOut(c), c.len(), k, 2.0f) + z.zorsNormalize_32f(in(c), out(c), c.len(), 0.3f, k);
        });
    }
    zt::agreesWithGeneric(variant(), [](const Api& z, Case& c) {
        const int n = c.len(), ch = 2 + c.index() % 2;  // deinterleave: the paired path and the general one
        int16_t* planes[3] = {c.out<int16_t>(n), c.out<int16_t>(n), c.out<int16_t>(n)};
        return z.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(c.in(c.floats(2 * n))), out(c), n) +
               z.zorsAbs_64f_I(c.inOut<double>(n), n) + z.zorsDeinterleave_16s(c.in<int16_t>(n * ch), ch, n, planes);
    });
}

// ---- float arithmetic -----------------------------------------------------------

// A single float operation rounded once is the double result rounded once;
// special values pass as pinned.
TEST_P(VecArith, FloatElementwiseMatchesArithmeticAndPinnedSpecials) {
    const int n = 37;
    const auto a = zt::randomFloats(n, 11), b = zt::randomFloats(n, 12, 1e-3f);
    // The export writes d (holding a); op(a[i], b[i]) is element i.
    const auto each = [&](auto call, auto op) { expectEach(a, call, [&](int i) { return op(a[i], b[i]); }); };
    each([&](float* d) { return z.zorsAdd_32f(a.data(), b.data(), d, n); }, [](float x, float y) { return x + y; });
    each([&](float* d) { return z.zorsAdd_32f_I(b.data(), d, n); }, [](float x, float y) { return x + y; });
    each([&](float* d) { return z.zorsSub_32f_I(b.data(), d, n); }, [](float x, float y) { return x - y; });
    each([&](float* d) { return z.zorsMul_32f_I(b.data(), d, n); }, [](float x, float y) { return x * y; });
    each([&](float* d) { return z.zorsDiv_32f_I(b.data(), d, n); }, [](float x, float y) { return x / y; });
    each([&](float* d) { return z.zorsSqr_32f(a.data(), d, n); }, [](float x, float) { return x * x; });
    each([&](float* d) { return z.zorsSqr_32f_I(d, n); }, [](float x, float) { return x * x; });
    each([&](float* d) { return z.zorsMulC_32f(a.data(), 3.5f, d, n); }, [](float x, float) { return x * 3.5f; });
    each([&](float* d) { return z.zorsSubC_32f(a.data(), 0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    each([&](float* d) { return z.zorsSubC_32f_I(0.25f, d, n); }, [](float x, float) { return x - 0.25f; });
    each([&](float* d) { return z.zorsAddC_32f_I(-7.0f, d, n); }, [](float x, float) { return x + -7.0f; });
    each([&](float* d) { return z.zorsMulC_32f_I(-7.0f, d, n); }, [](float x, float) { return x * -7.0f; });
    // Division by a constant multiplies by the float reciprocal (for 1/3 that
    // differs from division in the last bit of some elements).
    for (float val : {3.0f, -7.0f, 0.1f, 1e-30f}) {
        const volatile float r = 1.0f / val;  // volatile: rounded to float on the x87 unit too
        each([&](float* d) { return z.zorsDivC_32f(a.data(), val, d, n); }, [&r](float x, float) { return x * r; });
        each([&](float* d) { return z.zorsDivC_32f_I(val, d, n); }, [&r](float x, float) { return x * r; });
    }
    const std::vector<float> zeros(9), blank(9, 7.0f);  // IEEE division by zero, no status
    expectValues<float>({1, -1}, [&](float* d) { return z.zorsDiv_32f_I(zeros.data(), d, 2); }, {kInf, -kInf});

    // Multiplying by 1 and subtracting -0 copy, even a signalling NaN;
    // multiplying by 0 and dividing by infinity zero everything, without -0.
    // In-place subtraction of a constant has no shortcut: -0 - 0 is -0 and
    // the signalling NaN quiets.
    const std::vector<float> src = {floatOf(0x7F800001u), kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f};
    expectValues(blank, [&](float* d) { return z.zorsMulC_32f(src.data(), 1.0f, d, 9); }, src);
    expectValues(blank, [&](float* d) { return z.zorsSubC_32f(src.data(), -0.0f, d, 9); }, src);
    expectValues(src, [&](float* d) { return z.zorsMulC_32f_I(1.0f, d, 9) + z.zorsAddC_32f_I(0.0f, d, 9); }, src);
    expectValues(blank, [&](float* d) { return z.zorsMulC_32f(src.data(), 0.0f, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsMulC_32f_I(-0.0f, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsDivC_32f_I(-kInf, d, 9); }, zeros);
    expectValues(src, [&](float* d) { return z.zorsSubC_32f_I(0.0f, d, 9); },
                 {floatOf(0x7FC00001u), kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 1.0f});

    // Absolute value clears the sign bit; thresholds keep equal elements and
    // NaNs, clipping from above for CmpGreater and from below for any other
    // code; LTVal replaces what is below the level (and NaN).
    const std::vector<float> v = {-0.0f, -kInf, kNaN, floatOf(0xFFC00001u), -2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    const std::vector<float> abs = {0.0f, kInf, kNaN, floatOf(0x7FC00001u), 2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    expectValues(v, [&](float* d) { return z.zorsAbs_32f(v.data(), d, 9); }, abs);
    expectValues(v, [&](float* d) { return z.zorsAbs_32f_I(d, 9); }, abs);
    expectValues(v, [&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, CmpGreater); },
                 {-0.0f, -kInf, kNaN, v[3], -2.5f, 1.0f, 1.0f, 1.0f, 0.5f});
    for (int rel : {int(CmpLess), 1, 5, -1})
        expectValues(v, [&](float* d) { return z.zorsThreshold_32f_I(d, 9, 1.0f, rel); },
                     {1.0f, 1.0f, kNaN, v[3], 1.0f, 3.0f, 1.0f, 1.0f, 1.0f});
    const std::vector<float> lt = {9.0f, 9.0f, 9.0f, 9.0f, 9.0f, 3.0f, 1.0f, 1.0f, 9.0f};
    expectValues(v, [&](float* d) { return z.zorsThreshold_LTVal_32f(v.data(), d, 9, 1.0f, 9.0f); }, lt);
    expectValues(v, [&](float* d) { return z.zorsThreshold_LTVal_32f_I(d, 9, 1.0f, 9.0f); }, lt);

    // Square root: negative elements and NaNs become the quiet NaN
    // 0xFFC00000, with a warning.
    expectValues<float>({4.0f, -0.0f, 0.0f, 2.0f, kInf, 1e-40f}, [&](float* d) { return z.zorsSqrt_32f_I(d, 6); },
                        {2.0f, -0.0f, 0.0f, std::sqrt(2.0f), kInf, std::sqrt(1e-40f)});
    // The logarithm reports the first special element: a zero or a negative
    // (-0 and negative NaNs count as negative); NaNs otherwise pass quieted.
    // Both with the special elements in every lane position.
    for (int at : {0, 3, 4, 5, 7, 8, 9, 11, 12}) {
        std::vector<float> w(13, 9.0f);
        w[at] = at % 2 ? kNaN : -1.0f;
        expectEach(w, [&](float* d) { return z.zorsSqrt_32f_I(d, 13); }, [at](int i) { return i == at ? kNegNaN : 3.0f; },
                   StatusWarnSqrtNegative);
        w[at] = at % 2 ? floatOf(0xFFC01234u) : -0.0f, w[(at + 3) % 13] = 0.0f;  // and a zero three further on
        EXPECT_EQ(z.zorsLn_32f_I(w.data(), 13), at < (at + 3) % 13 ? StatusWarnLnNegative : StatusWarnLnZero) << at;
        EXPECT_TRUE(zt::sameBits(w[at], kNegNaN) && w[(at + 3) % 13] == -kInf) << at;
    }
    const std::vector<float> q = {floatOf(0x7FC01234u), floatOf(0x7F800001u), kInf, 1.0f};
    expectValues(q, [&](float* d) { return z.zorsLn_32f_I(d, 4); }, {q[0], floatOf(0x7FC00001u), kInf, 0.0f});
}

// ---- 16-bit and 64-bit ------------------------------------------------------------

// Against exact integers on every agreement case (lengths around every
// register width, buffers off alignment and against a protected page), with
// the extremes and small values (ties) among random ones.
TEST_P(VecArith, SixteenBitScalingRoundsAndSaturates) {
    for (int k = 0; k < zt::caseCount(); ++k) {
        Case c = zt::makeCase(k);
        const int n = c.len();
        int16_t *x = c.in<int16_t>(n), *y = c.in<int16_t>(n), *d = c.out<int16_t>(n);
        for (int i = 0; i < n; ++i) x[i] = i % 9 == 0 ? -32768 : i % 9 == 1 ? 32767 : x[i], y[i] = i % 5 ? y[i] : y[i] % 4;
        const int16_t r = int16_t(c.rng()());
        // call(d) writes d (holding x first for the in-place exports); element i must be op(x[i], y[i]).
        const auto each = [&](bool inPlace, auto call, auto op) {
            if (inPlace) std::copy(x, x + n, d);
            ASSERT_EQ(call(d), StatusOk);
            for (int i = 0; i < n; ++i) ASSERT_EQ(d[i], op(x[i], y[i])) << "length " << n << ": " << x[i] << ", " << y[i];
        };
        for (int sf = -18; sf <= 45; ++sf) {
            SCOPED_TRACE(sf);
            if (sf <= 18)  // the sum: ties to even; from -16 down only the sign survives
                each(false, [&](int16_t* o) { return z.zorsAdd_16s_Sfs(x, y, o, n, sf); },
                     [sf](int a, int b) { return tiesToEven(a + b, sf); });
            if (sf < 0) continue;  // the products: half up
            const auto product = [sf](int a, int b) { return halfUp(int64_t(a) * b, sf); };
            each(false, [&](int16_t* o) { return z.zorsMul_NR_16s_Sfs(x, y, o, n, sf); }, product);
            each(true, [&](int16_t* o) { return z.zorsMul_NR_16s_ISfs(y, o, n, sf); }, product);
            for (int16_t v : {int16_t(-32768), r}) {
                const auto byV = [sf, v](int a, int) { return halfUp(int64_t(a) * v, sf); };
                each(false, [&](int16_t* o) { return z.zorsMulC_NR_16s_Sfs(x, v, o, n, sf); }, byV);
                each(true, [&](int16_t* o) { return z.zorsMulC_NR_16s_ISfs(v, o, n, sf); }, byV);
            }
        }
        // Constants saturate (and 0 leaves the vector alone); |-32768| is 32767.
        for (int v : {-32768, -1000, 0, 1, 32767, int(r)}) {
            each(true, [&](int16_t* o) { return z.zorsAddC_16s_I(int16_t(v), o, n); }, [v](int a, int) { return sat16(a + v); });
            each(true, [&](int16_t* o) { return z.zorsSubC_16s_I(int16_t(v), o, n); }, [v](int a, int) { return sat16(a - v); });
        }
        const auto abs = [](int a, int) { return sat16(std::abs(a)); };
        each(false, [&](int16_t* o) { return z.zorsAbs_16s(x, o, n); }, abs);
        each(true, [&](int16_t* o) { return z.zorsAbs_16s_I(o, n); }, abs);
    }
    const std::vector<double> ds = {-0.0, -1.5, -double(kNaN), -1e300, 2.0}, dAbs = {0.0, 1.5, double(kNaN), 1e300, 2.0};
    expectValues(std::vector<double>(5), [&](double* d) { return z.zorsAbs_64f(ds.data(), d, 5); }, dAbs);
    expectValues(ds, [&](double* d) { return z.zorsAbs_64f_I(d, 5); }, dAbs);
}

// ---- logarithm, phase, magnitude ------------------------------------------------------

// The logarithm and the phase against the library's double functions rounded
// to float, bit for bit.  The logarithm over random bit patterns of every
// positive float and the places where the approximation changes table row
// (mantissa low bits around 0x4000), powers of two, the neighbourhood of 1
// and the ends of the range.
TEST_P(VecArith, LogarithmAndPhaseMatchRoundedLibraryOverManyInputs) {
    std::vector<float> src;
    std::mt19937 rng(2024);
    for (int i = 0; i < kSweep; ++i) src.push_back(floatOf(1 + rng() % 0x7F7FFFFFu));
    for (uint32_t e : {1u, 60u, 125u, 126u, 127u, 128u, 200u, 254u})  // row k's edge, mantissa low bits 0x4000 +- 2
        for (uint32_t k = 0; k < 256 * 5; ++k) src.push_back(floatOf((e << 23) | (k / 5) << 15 | (0x4000 + k % 5 - 2)));
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

    // The phase: random bit patterns (zeros, infinities and NaNs included),
    // magnitudes within 2^+-60 of each other in every quadrant, ratios next
    // to the table points k/64 (and next to 1, where the octants meet), small
    // integers, and the quadrant boundaries.
    std::mt19937_64 rng64(99);
    const int n = kSweep / 2;
    std::vector<float> y(n), x(n);
    // The sign and mantissa bits of u with exponent e.
    const auto withExponent = [](uint64_t u, uint64_t e) { return floatOf((uint32_t(u) & 0x807FFFFFu) | uint32_t(e) << 23); };
    for (int i = 0; i < n; ++i) {
        const uint64_t b = rng64();
        const float m = withExponent(b & 0x7FFFFFFF, 110 + (b >> 24) % 40);  // and m t, t next to k/64
        const float t = float((b >> 32) % 65) / 64.0f + float(int((b >> 40) % 2001) - 1000) * 0x1p-30f;
        if (i % 4 == 0)
            y[i] = floatOf(uint32_t(b)), x[i] = floatOf(uint32_t(b >> 32));
        else if (i % 4 == 1)
            y[i] = withExponent(b, 97 + (b >> 24) % 60), x[i] = withExponent(b >> 32, 97 + (b >> 56) % 60);
        else if (i % 4 == 2)
            y[i] = m * t * ((b >> 60) & 1 ? -1.0f : 1.0f), x[i] = (b >> 61) & 1 ? -m : m;
        else
            y[i] = float(int(b % 2001) - 1000), x[i] = float(int((b >> 20) % 2001) - 1000);
        if (i % 4 == 2 && (b >> 62) & 1) std::swap(y[i], x[i]);
    }
    // Pairs (y, x) whose atan2 lies within a few hundred double ulps of a
    // float rounding midpoint, in every lane position; then signed zeros and
    // infinities against each other.
    const uint32_t hard[] = {0x35d1e46f, 0xbfcb1f45, 0xbf89d3ac, 0x329300c5, 0x36c2cff3, 0x4b42ea0b, 0x479a92e3, 0x3e55d3b3,
                             0x4b63aab7, 0xc15fdf6b, 0xb6108402, 0xbeb7ffb1, 0x467d87d0, 0x48b569af, 0xb9c38785, 0xb5dffcb2,
                             0xb9d18983, 0x336b8d4d, 0xb2fdd19e, 0x36c9fe93, 0xb719abcf, 0xc20797ec, 0x4b4e6eaa, 0x3e5c2cff};
    int at = 5;
    for (int k = 0; k < 24; k += 2) y[at] = floatOf(hard[k]), x[at] = floatOf(hard[k + 1]), at += 9;
    const float edge[] = {0.0f, -0.0f, 1.0f, -1.0f, kInf, -kInf};
    for (float a : edge)
        for (float b : edge) y[at] = a, x[at++] = b;
    // Written over a copy of x; NaN results: any NaN will do.
    const auto want = [&](int i) { return roundedAtan2(y[i], x[i]); };
    expectEach(x, [&](float* d) { return z.zorsPhase_32f(x.data(), y.data(), d, n); }, want, StatusOk, true);
    expectEach(x, [&](float* d) { return z.zorsAtan2_32f_A21(y.data(), x.data(), d, n); }, want, StatusOk, true);

    // Magnitudes: squares summed in double, no overflow, no underflow.
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
    expectValues<float>({0, 0}, [&](float* d) { return z.zorsNormalize_32f(re.data(), d, 2, 1.0f, 3.0f); },
                        {static_cast<float>(2.0 * (1.0 / 3.0)), -2.0f});
}

// ---- sort and deinterleave ------------------------------------------------------------

TEST_P(VecArith, SortsDescending) {
    std::mt19937 rng(9);
    for (int n : {1, 2, 9, 10, 11, 100, 65536})
        for (int kind = 0; kind < 4; ++kind) {  // random, few distinct values, ascending, descending
            std::vector<float> v(n);
            for (int i = 0; i < n; ++i)
                v[i] = float(kind == 0 ? int(rng() % 2000001) - 1000000 : kind == 1 ? int(rng() % 7) - 3 : kind == 2 ? i : -i);
            std::vector<float> want = v;
            std::sort(want.begin(), want.end(), std::greater<float>());
            expectValues(v, [&](float* d) { return z.zorsSortDescend_32f_I(d, n); }, want);
        }
    // NaNs leave some order, but every element stays in the vector.
    std::vector<float> w = zt::randomFloats(3001, 4, 1000.0f, true), before = w;
    ASSERT_EQ(z.zorsSortDescend_32f_I(w.data(), 3001), StatusOk);
    EXPECT_TRUE(std::is_permutation(w.begin(), w.end(), before.begin(), [](float a, float b) { return zt::sameBits(a, b); }));
}

TEST_P(VecArith, DeinterleaveSplitsChannelsAndWarnsOnAlignment) {
    const int len = 37, stride = 48;  // planes 96 bytes apart: aligned like the block
    int16_t *src = zorsMalloc_16s(5 * len + 8), *mem = zorsMalloc_16s(5 * stride), *planes[5];
    for (int i = 0; i < 5 * len + 8; ++i) src[i] = static_cast<int16_t>(i * 977 - 30000);
    // Aligned: OK; a source or a destination off 16 bytes: done and warned.
    for (int ch : {1, 2, 3, 5})
        for (int shift : {0, 1, 2}) {
            for (int c = 0; c < ch; ++c) planes[c] = mem + c * stride + (shift == 2 && c == ch - 1 ? 4 : 0);
            EXPECT_EQ(z.zorsDeinterleave_16s(src + (shift == 1), ch, len, planes), shift ? StatusWarnMisaligned : StatusOk);
            for (int c = 0; c < ch; ++c)
                for (int i = 0; i < len; ++i) ASSERT_EQ(planes[c][i], src[(shift == 1) + i * ch + c]) << ch << " " << shift;
        }
    zorsFree(src), zorsFree(mem);
}

ZT_ALL_VARIANTS(VecArith);
