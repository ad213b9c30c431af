// Vector arithmetic and elementwise math, on every variant's entries.
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <random>
#include <sstream>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class VecArith : public zt::VariantTest {};
class VecArith16 : public zt::VariantTest {};
class VecMath : public zt::VariantTest {};
class VecSortSplit : public zt::VariantTest {};

using Api = zt::Api;

constexpr uint8_t kFill = 0xA5;

// n elements of T flush against a guard page, bytes preset to kFill.
template <class T>
struct Guarded {
    zt::GuardedBuffer buf;
    Guarded(int n, zt::Guard where = zt::Guard::After) : buf(sizeof(T) * (n > 0 ? n : 1), where) {
        std::memset(buf.data(), kFill, buf.size());
    }
    T* p() const { return buf.as<T>(); }
    bool untouched() const {
        for (size_t i = 0; i < buf.size(); ++i)
            if (buf.data()[i] != kFill) return false;
        return true;
    }
    void load(const std::vector<T>& v) { std::memcpy(buf.data(), v.data(), v.size() * sizeof(T)); }
    std::vector<T> get(int n) const { return std::vector<T>(p(), p() + n); }
};

uint32_t bitsOf(float x) { uint32_t u; std::memcpy(&u, &x, 4); return u; }
float floatOf(uint32_t u) { float x; std::memcpy(&x, &u, 4); return x; }
uint64_t bitsOf(double x) { uint64_t u; std::memcpy(&u, &x, 8); return u; }
double doubleOf(uint64_t u) { double x; std::memcpy(&x, &u, 8); return x; }

const float kInf = std::numeric_limits<float>::infinity();
const float kNaN = std::numeric_limits<float>::quiet_NaN();
const uint32_t kNegNaN = 0xFFC00000u;

// Lengths that reach every block size and tail of the SIMD loops.
const int kLengths[] = {1, 2, 3, 4, 5, 7, 8, 9, 12, 15, 16, 17, 31, 33, 64, 101, 1003};

// Random floats: mostly ordinary values of mixed magnitude, with zeros of
// both signs, infinities, NaNs, subnormals and huge values sprinkled in.
std::vector<float> randomFloats(int n, uint32_t seed, bool specials = true) {
    std::mt19937 rng(seed);
    std::uniform_real_distribution<float> u(-1.0f, 1.0f);
    std::uniform_int_distribution<int> e(-30, 30), pick(0, 39);
    const float sp[] = {0.0f, -0.0f, kInf, -kInf, kNaN, floatOf(0x7F800001u), 1e-40f, -3e-39f,
                        3e38f, -3e38f, 1.0f, -1.0f};
    std::vector<float> v(static_cast<size_t>(n));
    for (auto& x : v) {
        const int k = pick(rng);
        if (specials && k < 12)
            x = sp[k];
        else
            x = std::ldexp(u(rng), e(rng));
    }
    return v;
}

std::vector<int16_t> randomShorts(int n, uint32_t seed) {
    std::mt19937 rng(seed);
    std::uniform_int_distribution<int> u(-32768, 32767), pick(0, 9), small(-300, 300);
    const int16_t sp[] = {-32768, 32767, 0, -1, 1};
    std::vector<int16_t> v(static_cast<size_t>(n));
    for (auto& x : v) {
        const int k = pick(rng);
        x = static_cast<int16_t>(k < 5 ? sp[k] : k < 7 ? small(rng) : u(rng));
    }
    return v;
}

// Bit-for-bit equality.  With anyNaN, NaNs match any NaN: which operand's
// payload an arithmetic NaN carries is the processor's business (SSE keeps the
// first, x87 the larger, compilers may swap operands).
template <class T>
::testing::AssertionResult sameBits(const std::vector<T>& a, const std::vector<T>& b, bool anyNaN = false) {
    if (a.size() != b.size()) return ::testing::AssertionFailure() << "sizes differ";
    for (size_t i = 0; i < a.size(); ++i)
        if (std::memcmp(&a[i], &b[i], sizeof(T)) != 0 && !(anyNaN && a[i] != a[i] && b[i] != b[i]))
            return ::testing::AssertionFailure() << "element " << i << " of " << a.size() << ": " << +a[i]
                                                 << " vs " << +b[i];
    return ::testing::AssertionSuccess();
}

// ---- cross-variant runs ----------------------------------------------------------
//
// A case calls one export with up to two sources and one destination of n
// elements (in-place members work on the destination, preloaded with the
// first source).  The variant under test runs on guarded buffers; its
// outputs and status must match the generic variant's bit for bit.

template <class S, class D>
using Call = std::function<Status(const Api&, const S* a, const S* b, D* d, int n)>;

template <class S, class D>
void crossCheck(const Api& z, const char* name, const Call<S, D>& call, bool inPlace,
                std::vector<S> (*gen)(int, uint32_t), int srcPerElem = 1, bool anyNaN = false) {
    SCOPED_TRACE(name);
    uint32_t seed = 1;
    for (int n : kLengths) {
        for (zt::Guard where : {zt::Guard::After, zt::Guard::Before}) {
            const auto a = gen(n * srcPerElem, seed++), b = gen(n, seed++);
            Guarded<S> ga(n * srcPerElem, where), gb(n, where);
            Guarded<D> gd(n, where);
            ga.load(a);
            gb.load(b);
            std::vector<D> ref(static_cast<size_t>(n));
            if (inPlace) {
                std::memcpy(gd.p(), a.data(), n * sizeof(D));
                std::memcpy(ref.data(), a.data(), n * sizeof(D));
            }
            const Status want = call(zt::api(0), a.data(), b.data(), ref.data(), n);
            const Status got = call(z, ga.p(), gb.p(), gd.p(), n);
            ASSERT_EQ(got, want) << "n=" << n;
            ASSERT_TRUE(sameBits(gd.get(n), ref, anyNaN)) << "n=" << n;
        }
    }
}

std::vector<float> genF(int n, uint32_t seed) { return randomFloats(n, seed); }
std::vector<int16_t> genS(int n, uint32_t seed) { return randomShorts(n, seed); }

// Every failing argument check returns its status and writes nothing.
template <class T>
void expectLengthAndNullChecks(const std::function<Status(T* p, int n)>& call, const char* name) {
    SCOPED_TRACE(name);
    Guarded<T> g(8);
    EXPECT_EQ(call(nullptr, 0), StatusNullPointer);
    EXPECT_EQ(call(nullptr, 8), StatusNullPointer);
    EXPECT_EQ(call(g.p(), 0), StatusBadSize);
    EXPECT_EQ(call(g.p(), -4), StatusBadSize);
    EXPECT_TRUE(g.untouched());
}

}  // namespace

// ---- float arithmetic -------------------------------------------------------------

TEST_P(VecArith, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    float src[8] = {1, 2, 3, 4, 5, 6, 7, 8};
    using F = std::function<Status(float*, int)>;
    const std::pair<const char*, F> cases[] = {
        {"Add", [&](float* p, int n) { return z.zorsAdd_32f(src, src, p, n); }},
        {"Add src", [&](float* p, int n) { return z.zorsAdd_32f(p ? src : nullptr, src, p ? p : src, n); }},
        {"Add_I", [&](float* p, int n) { return z.zorsAdd_32f_I(src, p, n); }},
        {"Sub_I", [&](float* p, int n) { return z.zorsSub_32f_I(src, p, n); }},
        {"Mul_I", [&](float* p, int n) { return z.zorsMul_32f_I(src, p, n); }},
        {"Div_I", [&](float* p, int n) { return z.zorsDiv_32f_I(src, p, n); }},
        {"AddC_I", [&](float* p, int n) { return z.zorsAddC_32f_I(2, p, n); }},
        {"SubC", [&](float* p, int n) { return z.zorsSubC_32f(src, 2, p, n); }},
        {"SubC_I", [&](float* p, int n) { return z.zorsSubC_32f_I(2, p, n); }},
        {"MulC", [&](float* p, int n) { return z.zorsMulC_32f(src, 2, p, n); }},
        {"MulC_I", [&](float* p, int n) { return z.zorsMulC_32f_I(2, p, n); }},
        {"DivC", [&](float* p, int n) { return z.zorsDivC_32f(src, 0, p, n); }},  // zero divisor checked last
        {"DivC_I", [&](float* p, int n) { return z.zorsDivC_32f_I(0, p, n); }},
        {"Abs", [&](float* p, int n) { return z.zorsAbs_32f(src, p, n); }},
        {"Abs_I", [&](float* p, int n) { return z.zorsAbs_32f_I(p, n); }},
        {"Sqr", [&](float* p, int n) { return z.zorsSqr_32f(src, p, n); }},
        {"Sqr_I", [&](float* p, int n) { return z.zorsSqr_32f_I(p, n); }},
        {"Sqrt_I", [&](float* p, int n) { return z.zorsSqrt_32f_I(p, n); }},
        {"Ln_I", [&](float* p, int n) { return z.zorsLn_32f_I(p, n); }},
        {"Threshold_I", [&](float* p, int n) { return z.zorsThreshold_32f_I(p, n, 1, CmpGreater); }},
        {"LTVal", [&](float* p, int n) { return z.zorsThreshold_LTVal_32f(src, p, n, 1, 2); }},
        {"LTVal_I", [&](float* p, int n) { return z.zorsThreshold_LTVal_32f_I(p, n, 1, 2); }},
        {"Normalize", [&](float* p, int n) { return z.zorsNormalize_32f(src, p, n, 1, 0); }},
        {"Magnitude", [&](float* p, int n) { return z.zorsMagnitude_32f(src, src, p, n); }},
        {"Magnitude_c", [&](float* p, int n) {
             return z.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(src), p, n); }},
        {"Phase", [&](float* p, int n) { return z.zorsPhase_32f(src, src, p, n); }},
        {"PowerSpectr", [&](float* p, int n) { return z.zorsPowerSpectr_32f(src, src, p, n); }},
        {"Sort", [&](float* p, int n) { return z.zorsSortDescend_32f_I(p, n); }},
    };
    for (const auto& c : cases) expectLengthAndNullChecks<float>(c.second, c.first);

    // The arctangent checks the length before the pointers.
    EXPECT_EQ(z.zorsAtan2_32f_A21(nullptr, src, src, 0), StatusBadSize);
    EXPECT_EQ(z.zorsAtan2_32f_A21(src, nullptr, src, -1), StatusBadSize);
    EXPECT_EQ(z.zorsAtan2_32f_A21(src, src, nullptr, 1), StatusNullPointer);
    EXPECT_EQ(z.zorsAtan2_32f_A21(nullptr, src, src, 1), StatusNullPointer);

    // Divisors: zero and NaN refused before anything is written.
    Guarded<float> g(4);
    EXPECT_EQ(z.zorsDivC_32f(src, 0.0f, g.p(), 4), StatusDivideByZero);
    EXPECT_EQ(z.zorsDivC_32f(src, -0.0f, g.p(), 4), StatusDivideByZero);
    EXPECT_EQ(z.zorsDivC_32f(src, kNaN, g.p(), 4), StatusDivideByZero);
    EXPECT_EQ(z.zorsDivC_32f_I(kNaN, g.p(), 4), StatusDivideByZero);
    EXPECT_EQ(z.zorsNormalize_32f(src, g.p(), 4, 0, 1e-39f), StatusDivideByZero);
    EXPECT_EQ(z.zorsNormalize_32f(src, g.p(), 4, 0, -1e-39f), StatusDivideByZero);
    EXPECT_EQ(z.zorsNormalize_32f(src, g.p(), 4, 0, kNaN), StatusDivideByZero);
    EXPECT_TRUE(g.untouched());
    // The smallest normal float is accepted.
    EXPECT_EQ(z.zorsNormalize_32f(src, g.p(), 4, 0, -1.1754943508222875e-38f), StatusOk);
}

TEST_P(VecArith, ElementwiseMatchesFloatArithmetic) {
    const Api& z = this->z();
    // A single float operation rounded once is the double result rounded once.
    for (int n : {5, 64, 1003}) {
        const auto a = randomFloats(n, 11, false), b = randomFloats(n, 12, false);
        std::vector<float> d(n), e(n);
        ASSERT_EQ(z.zorsAdd_32f(a.data(), b.data(), d.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = a[i] + b[i];
        EXPECT_TRUE(sameBits(d, e));
        struct { decltype(&Api::zorsAdd_32f_I) fn; float (*op)(float, float); } ops[] = {
            {&Api::zorsAdd_32f_I, [](float x, float y) { return x + y; }},
            {&Api::zorsSub_32f_I, [](float x, float y) { return x - y; }},
            {&Api::zorsMul_32f_I, [](float x, float y) { return x * y; }},
            {&Api::zorsDiv_32f_I, [](float x, float y) { return x / y; }},
        };
        for (const auto& o : ops) {
            d = a;
            ASSERT_EQ((z.*o.fn)(b.data(), d.data(), n), StatusOk);
            for (int i = 0; i < n; ++i) e[i] = o.op(a[i], b[i]);  // srcDst op src
            EXPECT_TRUE(sameBits(d, e));
        }
        ASSERT_EQ(z.zorsSqr_32f(a.data(), d.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = a[i] * a[i];
        EXPECT_TRUE(sameBits(d, e));
        ASSERT_EQ(z.zorsMulC_32f(a.data(), 3.5f, d.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = a[i] * 3.5f;
        EXPECT_TRUE(sameBits(d, e));
        ASSERT_EQ(z.zorsSubC_32f(a.data(), 0.25f, d.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = a[i] - 0.25f;
        EXPECT_TRUE(sameBits(d, e));
        d = a;
        ASSERT_EQ(z.zorsAddC_32f_I(-7.0f, d.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) e[i] = a[i] + -7.0f;
        EXPECT_TRUE(sameBits(d, e));
    }
    // IEEE division by zero, no status.
    float x[2] = {1, -1};
    const float zero[2] = {0, 0};
    EXPECT_EQ(z.zorsDiv_32f_I(zero, x, 2), StatusOk);
    EXPECT_EQ(x[0], kInf);
    EXPECT_EQ(x[1], -kInf);
}

TEST_P(VecArith, ConstantShortcutsSkipTheArithmetic) {
    const Api& z = this->z();
    const float sNaN = floatOf(0x7F800001u);
    const std::vector<float> src = {sNaN, kInf, -0.0f, 1.5f, -kInf, kNaN, 3.0f, -2.0f, 9.0f};
    const int n = static_cast<int>(src.size());
    std::vector<float> d(n, 7.0f);
    // Multiply by 1 and subtract 0 copy, even a signalling NaN.
    ASSERT_EQ(z.zorsMulC_32f(src.data(), 1.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, src));
    d.assign(n, 7.0f);
    ASSERT_EQ(z.zorsSubC_32f(src.data(), -0.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, src));
    d = src;
    ASSERT_EQ(z.zorsMulC_32f_I(1.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, src));
    ASSERT_EQ(z.zorsAddC_32f_I(0.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, src));
    // Multiply by 0 zeroes: infinities and NaNs too, and no -0.0.
    const std::vector<float> zeros(n, 0.0f);
    ASSERT_EQ(z.zorsMulC_32f(src.data(), 0.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, zeros));
    d = src;
    ASSERT_EQ(z.zorsMulC_32f_I(-0.0f, d.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, zeros));
    // In-place subtraction of a constant has no shortcut: -0 - 0 is -0, sNaN quiets.
    d = src;
    ASSERT_EQ(z.zorsSubC_32f_I(0.0f, d.data(), n), StatusOk);
    EXPECT_EQ(bitsOf(d[2]), 0x80000000u);
    EXPECT_TRUE(std::isnan(d[0]));
    EXPECT_NE(bitsOf(d[0]), bitsOf(sNaN));
}

TEST_P(VecArith, DivisionByConstantMultipliesByTheFloatReciprocal) {
    const Api& z = this->z();
    const int n = 4096;
    std::vector<float> a(n);
    for (int i = 0; i < n; ++i) a[i] = 1.0f + i * (1.0f / 1024);
    std::vector<float> d(n), e(n);
    for (float val : {3.0f, -7.0f, 0.1f, 1e-30f}) {
        ASSERT_EQ(z.zorsDivC_32f(a.data(), val, d.data(), n), StatusOk);
        // The float reciprocal, correctly rounded as the double one rounded
        // once (volatile: kept out of x87 registers).
        volatile float r = 1.0f / val;
        int differsFromDivision = 0;
        for (int i = 0; i < n; ++i) {
            volatile float prod = a[i] * r, quot = a[i] / val;
            e[i] = prod;
            differsFromDivision += prod != quot;
        }
        EXPECT_TRUE(sameBits(d, e)) << val;
        if (val == 3.0f) {
            EXPECT_GT(differsFromDivision, 0);  // the last-bit difference is real
        }
        std::vector<float> f = a;
        ASSERT_EQ(z.zorsDivC_32f_I(val, f.data(), n), StatusOk);
        EXPECT_TRUE(sameBits(f, e));
    }
    // A divisor of 1 copies; an infinite divisor has reciprocal 0 and zeroes.
    std::vector<float> s = {kInf, kNaN, -0.0f, 2.0f};
    ASSERT_EQ(z.zorsDivC_32f(s.data(), 1.0f, d.data(), 4), StatusOk);
    EXPECT_TRUE(sameBits(std::vector<float>(d.begin(), d.begin() + 4), s));
    ASSERT_EQ(z.zorsDivC_32f_I(-kInf, s.data(), 4), StatusOk);
    EXPECT_TRUE(sameBits(s, std::vector<float>(4, 0.0f)));
}

TEST_P(VecArith, AbsSqrThresholds) {
    const Api& z = this->z();
    const std::vector<float> src = {-0.0f, -kInf, kNaN, floatOf(0xFFC00001u), -2.5f, 3.0f, 1.0f, 1.0f, 0.5f};
    const int n = static_cast<int>(src.size());
    std::vector<float> d(n);
    ASSERT_EQ(z.zorsAbs_32f(src.data(), d.data(), n), StatusOk);
    for (int i = 0; i < n; ++i) EXPECT_EQ(bitsOf(d[i]), bitsOf(src[i]) & 0x7FFFFFFFu) << i;

    // Clip from above at 1 (CmpGreater), from below for any other code; equal
    // elements and NaNs are kept.
    d = src;
    ASSERT_EQ(z.zorsThreshold_32f_I(d.data(), n, 1.0f, CmpGreater), StatusOk);
    const std::vector<float> above = {-0.0f, -kInf, kNaN, floatOf(0xFFC00001u), -2.5f, 1.0f, 1.0f, 1.0f, 0.5f};
    EXPECT_TRUE(sameBits(d, above));
    for (int rel : {int(CmpLess), 1, 2, 3, 5, -1}) {
        d = src;
        ASSERT_EQ(z.zorsThreshold_32f_I(d.data(), n, 1.0f, rel), StatusOk);
        const std::vector<float> below = {1.0f, 1.0f, kNaN, floatOf(0xFFC00001u), 1.0f, 3.0f, 1.0f, 1.0f, 1.0f};
        EXPECT_TRUE(sameBits(d, below)) << rel;
    }
    // Below level (and NaN) to value.
    ASSERT_EQ(z.zorsThreshold_LTVal_32f(src.data(), d.data(), n, 1.0f, 9.0f), StatusOk);
    const std::vector<float> lt = {9.0f, 9.0f, 9.0f, 9.0f, 9.0f, 3.0f, 1.0f, 1.0f, 9.0f};
    EXPECT_TRUE(sameBits(d, lt));
    d = src;
    ASSERT_EQ(z.zorsThreshold_LTVal_32f_I(d.data(), n, 1.0f, 9.0f), StatusOk);
    EXPECT_TRUE(sameBits(d, lt));
}

TEST_P(VecArith, AgreesWithGenericOnGuardedBuffers) {
    const Api& z = this->z();
    using C = Call<float, float>;
    // Arithmetic: NaN payloads may differ.
    const std::pair<const char*, C> arithmetic[] = {
        {"Add", [](const Api& a, const float* x, const float* y, float* d, int n) { return a.zorsAdd_32f(x, y, d, n); }},
        {"SubC", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsSubC_32f(x, 1.25f, d, n); }},
        {"MulC", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsMulC_32f(x, -3.0f, d, n); }},
        {"DivC", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsDivC_32f(x, 7.0f, d, n); }},
        {"Sqr", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsSqr_32f(x, d, n); }},
        {"Normalize", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsNormalize_32f(x, d, n, 0.3f, 3.0f); }},
        {"Magnitude", [](const Api& a, const float* x, const float* y, float* d, int n) { return a.zorsMagnitude_32f(x, y, d, n); }},
        {"PowerSpectr", [](const Api& a, const float* x, const float* y, float* d, int n) { return a.zorsPowerSpectr_32f(x, y, d, n); }},
        {"Phase", [](const Api& a, const float* x, const float* y, float* d, int n) { return a.zorsPhase_32f(x, y, d, n); }},
        {"Atan2", [](const Api& a, const float* x, const float* y, float* d, int n) { return a.zorsAtan2_32f_A21(x, y, d, n); }},
    };
    for (const auto& c : arithmetic) crossCheck<float, float>(z, c.first, c.second, false, genF, 1, true);
    crossCheck<float, float>(z, "Magnitude_c",
                             [](const Api& a, const float* x, const float*, float* d, int n) {
                                 return a.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(x), d, n);
                             },
                             false, genF, 2, true);
    // Bit operations and selections: every NaN exactly.
    crossCheck<float, float>(z, "Abs", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsAbs_32f(x, d, n); }, false, genF);
    crossCheck<float, float>(z, "LTVal", [](const Api& a, const float* x, const float*, float* d, int n) { return a.zorsThreshold_LTVal_32f(x, d, n, 0.0f, -5.0f); }, false, genF);
    const std::pair<const char*, C> arithmeticInPlace[] = {
        {"Add_I", [](const Api& a, const float*, const float* y, float* d, int n) { return a.zorsAdd_32f_I(y, d, n); }},
        {"Sub_I", [](const Api& a, const float*, const float* y, float* d, int n) { return a.zorsSub_32f_I(y, d, n); }},
        {"Mul_I", [](const Api& a, const float*, const float* y, float* d, int n) { return a.zorsMul_32f_I(y, d, n); }},
        {"Div_I", [](const Api& a, const float*, const float* y, float* d, int n) { return a.zorsDiv_32f_I(y, d, n); }},
        {"AddC_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsAddC_32f_I(0.5f, d, n); }},
        {"SubC_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsSubC_32f_I(0.5f, d, n); }},
        {"MulC_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsMulC_32f_I(1e30f, d, n); }},
        {"DivC_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsDivC_32f_I(1e-3f, d, n); }},
        {"Sqr_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsSqr_32f_I(d, n); }},
    };
    for (const auto& c : arithmeticInPlace) crossCheck<float, float>(z, c.first, c.second, true, genF, 1, true);
    const std::pair<const char*, C> exactInPlace[] = {
        {"Abs_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsAbs_32f_I(d, n); }},
        {"Sqrt_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsSqrt_32f_I(d, n); }},
        {"Ln_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsLn_32f_I(d, n); }},
        {"ThrGT", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsThreshold_32f_I(d, n, 0.1f, CmpGreater); }},
        {"ThrLT", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsThreshold_32f_I(d, n, 0.1f, CmpLess); }},
        {"LTVal_I", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsThreshold_LTVal_32f_I(d, n, 0.1f, 2.0f); }},
        {"Sort", [](const Api& a, const float*, const float*, float* d, int n) { return a.zorsSortDescend_32f_I(d, n); }},
    };
    for (const auto& c : exactInPlace) crossCheck<float, float>(z, c.first, c.second, true, genF);
}

// ---- 16-bit integer arithmetic ------------------------------------------------------

namespace {
// r * 2^-sf rounded to nearest, ties to even, saturated: the straightforward way.
int16_t refScaleEven(int64_t r, int sf) {
    const long double v = std::ldexp(static_cast<long double>(r), -sf);
    long double f = std::floor(v);
    const long double frac = v - f;
    if (frac > 0.5L || (frac == 0.5L && std::fmod(f, 2.0L) != 0)) f += 1;
    return static_cast<int16_t>(std::max<long double>(-32768, std::min<long double>(32767, f)));
}
// Half up: floor(r * 2^-sf + 1/2).
int16_t refScaleHalfUp(int64_t r, int sf) {
    const long double f = std::floor(std::ldexp(static_cast<long double>(r), -sf) + 0.5L);
    return static_cast<int16_t>(std::max<long double>(-32768, std::min<long double>(32767, f)));
}
}  // namespace

TEST_P(VecArith16, ChecksComeInOrderAndWriteNothing) {
    const Api& z = this->z();
    int16_t src[8] = {1, 2, 3, 4, 5, 6, 7, 8};
    using F = std::function<Status(int16_t*, int)>;
    const std::pair<const char*, F> cases[] = {
        {"Add_Sfs", [&](int16_t* p, int n) { return z.zorsAdd_16s_Sfs(src, src, p, n, 0); }},
        {"AddC_I", [&](int16_t* p, int n) { return z.zorsAddC_16s_I(3, p, n); }},
        {"SubC_I", [&](int16_t* p, int n) { return z.zorsSubC_16s_I(3, p, n); }},
        {"Mul_NR", [&](int16_t* p, int n) { return z.zorsMul_NR_16s_Sfs(src, src, p, n, -1); }},
        {"Mul_NR_I", [&](int16_t* p, int n) { return z.zorsMul_NR_16s_ISfs(src, p, n, -1); }},
        {"MulC_NR", [&](int16_t* p, int n) { return z.zorsMulC_NR_16s_Sfs(src, 3, p, n, -1); }},
        {"MulC_NR_I", [&](int16_t* p, int n) { return z.zorsMulC_NR_16s_ISfs(3, p, n, -1); }},
        {"Abs", [&](int16_t* p, int n) { return z.zorsAbs_16s(src, p, n); }},
        {"Abs_I", [&](int16_t* p, int n) { return z.zorsAbs_16s_I(p, n); }},
    };
    for (const auto& c : cases) expectLengthAndNullChecks<int16_t>(c.second, c.first);

    // A negative scale factor of the _NR members is refused after the other checks.
    Guarded<int16_t> g(8);
    EXPECT_EQ(z.zorsMul_NR_16s_Sfs(src, src, g.p(), 8, -1), StatusBadScaleFactor);
    EXPECT_EQ(z.zorsMul_NR_16s_ISfs(src, g.p(), 8, -5), StatusBadScaleFactor);
    EXPECT_EQ(z.zorsMulC_NR_16s_Sfs(src, 2, g.p(), 8, -1), StatusBadScaleFactor);
    EXPECT_EQ(z.zorsMulC_NR_16s_ISfs(2, g.p(), 8, -1), StatusBadScaleFactor);
    EXPECT_TRUE(g.untouched());

    Guarded<double> gd(4);
    const double dsrc[4] = {1, 2, 3, 4};
    EXPECT_EQ(z.zorsAbs_64f(dsrc, nullptr, 4), StatusNullPointer);
    EXPECT_EQ(z.zorsAbs_64f(nullptr, gd.p(), 0), StatusNullPointer);
    EXPECT_EQ(z.zorsAbs_64f(dsrc, gd.p(), 0), StatusBadSize);
    EXPECT_EQ(z.zorsAbs_64f_I(nullptr, 4), StatusNullPointer);
    EXPECT_EQ(z.zorsAbs_64f_I(gd.p(), -1), StatusBadSize);
    EXPECT_TRUE(gd.untouched());
}

TEST_P(VecArith16, ScaledSumRoundsTiesToEven) {
    const Api& z = this->z();
    const int16_t a[3] = {1, 2, -1}, b[3] = {2, 3, -2};
    int16_t d[3];
    ASSERT_EQ(z.zorsAdd_16s_Sfs(a, b, d, 3, 1), StatusOk);
    EXPECT_EQ(d[0], 2);   // 1.5
    EXPECT_EQ(d[1], 2);   // 2.5
    EXPECT_EQ(d[2], -2);  // -1.5

    // Every scale factor against the reference, on sums that reach both ends.
    const int n = 1001;
    const auto x = randomShorts(n, 3), y = randomShorts(n, 4);
    std::vector<int16_t> out(n);
    for (int sf = -40; sf <= 40; ++sf) {
        ASSERT_EQ(z.zorsAdd_16s_Sfs(x.data(), y.data(), out.data(), n, sf), StatusOk);
        for (int i = 0; i < n; ++i) {
            const int32_t s = x[i] + y[i];
            const int16_t want = sf <= -16 ? (s > 0 ? 32767 : s < 0 ? -32768 : 0) : refScaleEven(s, sf);
            ASSERT_EQ(out[i], want) << "sf=" << sf << " " << x[i] << "+" << y[i];
        }
    }
}

TEST_P(VecArith16, NoRoundingMultipliesRoundHalfUp) {
    const Api& z = this->z();
    const int16_t a[3] = {5, -5, 300}, b[3] = {1, 1, 300};
    int16_t d[3];
    ASSERT_EQ(z.zorsMul_NR_16s_Sfs(a, b, d, 3, 1), StatusOk);
    EXPECT_EQ(d[0], 3);
    EXPECT_EQ(d[1], -2);
    ASSERT_EQ(z.zorsMul_NR_16s_Sfs(a, b, d, 3, 0), StatusOk);
    EXPECT_EQ(d[2], 32767);

    const int n = 1001;
    const auto x = randomShorts(n, 5), y = randomShorts(n, 6);
    std::vector<int16_t> out(n), io(n), ref(n);
    for (int sf = 0; sf <= 40; ++sf) {
        for (int i = 0; i < n; ++i) ref[i] = refScaleHalfUp(int64_t(x[i]) * y[i], sf);
        ASSERT_EQ(z.zorsMul_NR_16s_Sfs(x.data(), y.data(), out.data(), n, sf), StatusOk);
        ASSERT_EQ(out, ref) << "sf=" << sf;
        io = y;
        ASSERT_EQ(z.zorsMul_NR_16s_ISfs(x.data(), io.data(), n, sf), StatusOk);
        ASSERT_EQ(io, ref) << "sf=" << sf;
        for (int16_t c : {int16_t(-32768), int16_t(-3), int16_t(0), int16_t(7), int16_t(32767)}) {
            for (int i = 0; i < n; ++i) ref[i] = refScaleHalfUp(int64_t(x[i]) * c, sf);
            ASSERT_EQ(z.zorsMulC_NR_16s_Sfs(x.data(), c, out.data(), n, sf), StatusOk);
            ASSERT_EQ(out, ref) << "sf=" << sf << " c=" << c;
            io = x;
            ASSERT_EQ(z.zorsMulC_NR_16s_ISfs(c, io.data(), n, sf), StatusOk);
            ASSERT_EQ(io, ref) << "sf=" << sf << " c=" << c;
        }
    }
}

TEST_P(VecArith16, SaturatingConstantsAndAbs) {
    const Api& z = this->z();
    const int n = 517;
    const auto x = randomShorts(n, 8);
    std::vector<int16_t> io(n);
    for (int c : {-32768, -32767, -1000, -1, 1, 999, 32767}) {
        io = x;
        ASSERT_EQ(z.zorsAddC_16s_I(static_cast<int16_t>(c), io.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) ASSERT_EQ(io[i], std::clamp(x[i] + c, -32768, 32767)) << c;
        io = x;
        ASSERT_EQ(z.zorsSubC_16s_I(static_cast<int16_t>(c), io.data(), n), StatusOk);
        for (int i = 0; i < n; ++i) ASSERT_EQ(io[i], std::clamp(x[i] - c, -32768, 32767)) << c;
    }
    io = x;
    ASSERT_EQ(z.zorsAddC_16s_I(0, io.data(), n), StatusOk);
    EXPECT_EQ(io, x);
    ASSERT_EQ(z.zorsSubC_16s_I(0, io.data(), n), StatusOk);
    EXPECT_EQ(io, x);

    std::vector<int16_t> out(n);
    ASSERT_EQ(z.zorsAbs_16s(x.data(), out.data(), n), StatusOk);
    for (int i = 0; i < n; ++i) ASSERT_EQ(out[i], std::min(32767, std::abs(int(x[i]))));
    const int16_t m = -32768;
    int16_t r;
    ASSERT_EQ(z.zorsAbs_16s(&m, &r, 1), StatusOk);
    EXPECT_EQ(r, 32767);
    io = x;
    ASSERT_EQ(z.zorsAbs_16s_I(io.data(), n), StatusOk);
    EXPECT_EQ(io, out);

    const std::vector<double> ds = {-0.0, -1.5, doubleOf(0xFFF8000000000123ull),
                                    -std::numeric_limits<double>::infinity(), 2.0};
    std::vector<double> dd(ds.size());
    ASSERT_EQ(z.zorsAbs_64f(ds.data(), dd.data(), 5), StatusOk);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(bitsOf(dd[i]), bitsOf(ds[i]) & 0x7FFFFFFFFFFFFFFFull) << i;
    dd = ds;
    ASSERT_EQ(z.zorsAbs_64f_I(dd.data(), 5), StatusOk);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(bitsOf(dd[i]), bitsOf(ds[i]) & 0x7FFFFFFFFFFFFFFFull) << i;
}

TEST_P(VecArith16, AgreesWithGenericOnGuardedBuffers) {
    const Api& z = this->z();
    using C = Call<int16_t, int16_t>;
    for (int sf : {-17, -16, -3, 0, 1, 2, 7, 16, 17}) {
        crossCheck<int16_t, int16_t>(z, "Add_Sfs",
            [sf](const Api& a, const int16_t* x, const int16_t* y, int16_t* d, int n) { return a.zorsAdd_16s_Sfs(x, y, d, n, sf); },
            false, genS);
    }
    for (int sf : {0, 1, 5, 15, 16, 30, 31, 32, 45}) {
        crossCheck<int16_t, int16_t>(z, "Mul_NR",
            [sf](const Api& a, const int16_t* x, const int16_t* y, int16_t* d, int n) { return a.zorsMul_NR_16s_Sfs(x, y, d, n, sf); },
            false, genS);
        crossCheck<int16_t, int16_t>(z, "Mul_NR_I",
            [sf](const Api& a, const int16_t*, const int16_t* y, int16_t* d, int n) { return a.zorsMul_NR_16s_ISfs(y, d, n, sf); },
            true, genS);
        crossCheck<int16_t, int16_t>(z, "MulC_NR",
            [sf](const Api& a, const int16_t* x, const int16_t*, int16_t* d, int n) { return a.zorsMulC_NR_16s_Sfs(x, -32768, d, n, sf); },
            false, genS);
        crossCheck<int16_t, int16_t>(z, "MulC_NR_I",
            [sf](const Api& a, const int16_t*, const int16_t*, int16_t* d, int n) { return a.zorsMulC_NR_16s_ISfs(-123, d, n, sf); },
            true, genS);
    }
    const std::pair<const char*, C> cases[] = {
        {"AddC_I", [](const Api& a, const int16_t*, const int16_t*, int16_t* d, int n) { return a.zorsAddC_16s_I(-20000, d, n); }},
        {"SubC_I", [](const Api& a, const int16_t*, const int16_t*, int16_t* d, int n) { return a.zorsSubC_16s_I(-32768, d, n); }},
        {"Abs_I", [](const Api& a, const int16_t*, const int16_t*, int16_t* d, int n) { return a.zorsAbs_16s_I(d, n); }},
    };
    for (const auto& c : cases) crossCheck<int16_t, int16_t>(z, c.first, c.second, true, genS);
    crossCheck<int16_t, int16_t>(z, "Abs",
        [](const Api& a, const int16_t* x, const int16_t*, int16_t* d, int n) { return a.zorsAbs_16s(x, d, n); }, false, genS);
}

// ---- square root, logarithm, magnitude, phase --------------------------------------------

TEST_P(VecMath, SquareRootMarksNegativesAndNaNs) {
    const Api& z = this->z();
    std::vector<float> v = {4.0f, -0.0f, 0.0f, 2.0f, kInf, 1e-40f};
    const int n = static_cast<int>(v.size());
    ASSERT_EQ(z.zorsSqrt_32f_I(v.data(), n), StatusOk);
    EXPECT_EQ(v[0], 2.0f);
    EXPECT_EQ(bitsOf(v[1]), 0x80000000u);
    EXPECT_EQ(bitsOf(v[2]), 0u);
    EXPECT_EQ(v[3], std::sqrt(2.0f));
    EXPECT_EQ(v[4], kInf);
    EXPECT_EQ(v[5], std::sqrt(1e-40f));
    for (int at : {0, 3, 4, 8, 9, 12}) {
        std::vector<float> w(13, 9.0f);
        w[at] = at % 2 ? kNaN : -1.0f;
        ASSERT_EQ(z.zorsSqrt_32f_I(w.data(), 13), StatusWarnSqrtNegative) << at;
        for (int i = 0; i < 13; ++i) EXPECT_EQ(bitsOf(w[i]), i == at ? kNegNaN : bitsOf(3.0f)) << at;
    }
}

TEST_P(VecMath, LogarithmReportsTheFirstSpecialElement) {
    const Api& z = this->z();
    std::vector<float> v = {1.0f, 0.0f, -1.0f};
    ASSERT_EQ(z.zorsLn_32f_I(v.data(), 3), StatusWarnLnZero);
    EXPECT_EQ(bitsOf(v[0]), 0u);
    EXPECT_EQ(v[1], -kInf);
    EXPECT_EQ(bitsOf(v[2]), kNegNaN);
    v = {-1.0f, 0.0f};
    EXPECT_EQ(z.zorsLn_32f_I(v.data(), 2), StatusWarnLnNegative);
    // -0.0 counts as negative; NaNs are no condition: a quiet one stays, a
    // signalling one is quieted, a negative one is negative.
    for (int at : {0, 5, 7, 8, 11}) {
        std::vector<float> w(12, 2.0f);
        w[at] = -0.0f;
        w[(at + 3) % 12] = 0.0f;
        EXPECT_EQ(z.zorsLn_32f_I(w.data(), 12), at < (at + 3) % 12 ? StatusWarnLnNegative : StatusWarnLnZero)
            << at;
        EXPECT_EQ(bitsOf(w[at]), kNegNaN);
    }
    std::vector<float> q = {floatOf(0x7FC01234u), floatOf(0x7F800001u), kInf, 1.0f, 2.0f};
    EXPECT_EQ(z.zorsLn_32f_I(q.data(), 5), StatusOk);
    EXPECT_EQ(bitsOf(q[0]), 0x7FC01234u);
    EXPECT_EQ(bitsOf(q[1]), 0x7FC00001u);
    EXPECT_EQ(q[2], kInf);
    q = {floatOf(0xFFC01234u), 0.0f};
    EXPECT_EQ(z.zorsLn_32f_I(q.data(), 2), StatusWarnLnNegative);
    EXPECT_EQ(bitsOf(q[0]), kNegNaN);
}

namespace {
// Float distance in units in the last place (same sign, finite).
int64_t ulps(float a, float b) {
    return std::llabs(static_cast<int64_t>(static_cast<int32_t>(bitsOf(a))) -
                      static_cast<int64_t>(static_cast<int32_t>(bitsOf(b))));
}
// Positive floats spread over the whole range, subnormals and the
// neighbourhood of 1 included.
std::vector<float> sweepPositive(int n) {
    std::vector<float> v;
    std::mt19937 rng(77);
    std::uniform_int_distribution<uint32_t> u(1, 0x7F7FFFFF);
    for (int i = 0; i < n; ++i) v.push_back(floatOf(u(rng)));
    for (int i = -3000; i <= 3000; ++i) v.push_back(floatOf(bitsOf(1.0f) + i));
    for (uint32_t k = 0; k < 24; ++k) v.push_back(floatOf(0x3F800000u + (k << 16)));
    return v;
}
}  // namespace

TEST_P(VecMath, LogarithmIsTheRoundedDoubleLogarithm) {
    const Api& z = this->z();
    const auto src = sweepPositive(60000);
    const int n = static_cast<int>(src.size());
    std::vector<float> d = src, g = src;
    ASSERT_EQ(z.zorsLn_32f_I(d.data(), n), StatusOk);
    ASSERT_EQ(zt::api(0).zorsLn_32f_I(g.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, g));
    int64_t worst = 0;
    for (int i = 0; i < n; ++i) worst = std::max(worst, ulps(d[i], static_cast<float>(std::log(double(src[i])))));
    EXPECT_LE(worst, 1);  // exact against the library's own log; 1 allows the test's x87 rounding
    EXPECT_EQ(bitsOf(d[n - 24]), 0u);  // log(1)
}

TEST_P(VecMath, ArctangentQuadrantsAndAccuracy) {
    const Api& z = this->z();
    const float pi = static_cast<float>(3.14159265358979323846);
    const float half = static_cast<float>(1.57079632679489661923);
    // Phase takes (re, im); the A21 arctangent takes (y, x).
    struct Case { float re, im, want; } cases[] = {
        {1, 0, 0}, {-1, 0, pi}, {-1, -0.0f, -pi}, {0, 1, half}, {0, -1, -half},
        {0, 0, 0}, {-0.0f, 0, pi}, {-0.0f, -0.0f, -pi}, {kInf, kInf, pi / 4},
        {-kInf, 1, pi}, {1, kInf, half}, {1, 1, pi / 4}, {-1, -1, static_cast<float>(-2.35619449019234492885)},
    };
    for (const Case& c : cases) {
        float r;
        ASSERT_EQ(z.zorsPhase_32f(&c.re, &c.im, &r, 1), StatusOk);
        EXPECT_EQ(bitsOf(r), bitsOf(c.want)) << c.re << "," << c.im;
        ASSERT_EQ(z.zorsAtan2_32f_A21(&c.im, &c.re, &r, 1), StatusOk);
        EXPECT_EQ(bitsOf(r), bitsOf(c.want)) << c.re << "," << c.im;
    }
    float nanOut;
    ASSERT_EQ(z.zorsPhase_32f(&kNaN, &kInf, &nanOut, 1), StatusOk);
    EXPECT_TRUE(std::isnan(nanOut));

    // Random quadrants and magnitude ratios: the rounded double arctangent,
    // the same bits as the generic variant, far inside 21 bits.
    std::mt19937 rng(5);
    std::uniform_real_distribution<float> u(-1, 1);
    std::uniform_int_distribution<int> e(-60, 60);
    const int n = 40000;
    std::vector<float> y(n), x(n), d(n), g(n), p(n);
    for (int i = 0; i < n; ++i) {
        y[i] = std::ldexp(u(rng), e(rng));
        x[i] = i % 7 ? std::ldexp(u(rng), e(rng)) : y[i] * (i % 2 ? 1 : -1);
    }
    ASSERT_EQ(z.zorsAtan2_32f_A21(y.data(), x.data(), d.data(), n), StatusOk);
    ASSERT_EQ(zt::api(0).zorsAtan2_32f_A21(y.data(), x.data(), g.data(), n), StatusOk);
    ASSERT_EQ(z.zorsPhase_32f(x.data(), y.data(), p.data(), n), StatusOk);
    EXPECT_TRUE(sameBits(d, g));
    EXPECT_TRUE(sameBits(d, p));
    int64_t worst = 0;
    for (int i = 0; i < n; ++i)
        worst = std::max(worst, ulps(d[i], static_cast<float>(std::atan2(double(y[i]), double(x[i])))));
    EXPECT_LE(worst, 1);
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

// Finds the first element whose bits differ from want's.
::testing::AssertionResult bitsEqual(const std::vector<float>& got, const std::vector<float>& want,
                                     const std::vector<float>& in1, const std::vector<float>* in2 = nullptr) {
    for (size_t i = 0; i < got.size(); ++i)
        if (bitsOf(got[i]) != bitsOf(want[i])) {
            std::ostringstream m;
            m << std::hexfloat << "input " << in1[i];
            if (in2) m << ", " << (*in2)[i];
            m << ": got " << got[i] << ", want " << want[i];
            return ::testing::AssertionFailure() << m.str();
        }
    return ::testing::AssertionSuccess();
}
}  // namespace

// Against the library's double logarithm rounded to float, bit for bit, over
// random bit patterns of every positive float and the places where the
// approximation changes table row (mantissa low bits around 0x4000), powers
// of two, the neighbourhood of 1 and the ends of the range.
TEST_P(VecMath, LogarithmMatchesRoundedLibraryOverManyInputs) {
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
// k/64 (and next to 1, where the octants meet), small integers.
TEST_P(VecMath, PhaseMatchesRoundedLibraryOverManyInputs) {
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
    // rounding midpoint, in every lane position.
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

TEST_P(VecMath, MagnitudePowerAndNormalizeInDouble) {
    const Api& z = this->z();
    const float re[4] = {3, -5, 1e30f, 1e-30f}, im[4] = {4, 12, 1e30f, 0};
    float d[4];
    ASSERT_EQ(z.zorsMagnitude_32f(re, im, d, 4), StatusOk);
    EXPECT_EQ(d[0], 5.0f);
    EXPECT_EQ(d[1], 13.0f);
    EXPECT_EQ(d[2], static_cast<float>(std::sqrt(2.0) * double(1e30f)));  // no overflow in double
    EXPECT_EQ(d[3], 1e-30f);                                       // no underflow either
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

// ---- sort and deinterleave ------------------------------------------------------------------

TEST_P(VecSortSplit, SortsDescending) {
    const Api& z = this->z();
    std::mt19937 rng(9);
    for (int n : {1, 2, 3, 9, 10, 11, 17, 100, 1000, 65536}) {
        for (int kind = 0; kind < 5; ++kind) {
            std::vector<float> v(n);
            std::uniform_int_distribution<int> few(-3, 3);
            std::uniform_real_distribution<float> u(-1e6f, 1e6f);
            for (int i = 0; i < n; ++i)
                v[i] = kind == 0 ? u(rng) : kind == 1 ? float(few(rng)) : kind == 2 ? float(i) : kind == 3 ? float(-i) : 5.0f;
            Guarded<float> g(n, n % 2 ? zt::Guard::After : zt::Guard::Before);
            g.load(v);
            ASSERT_EQ(z.zorsSortDescend_32f_I(g.p(), n), StatusOk);
            std::vector<float> want = v;
            std::sort(want.begin(), want.end(), [](float a, float b) { return a > b; });
            ASSERT_EQ(g.get(n), want) << "n=" << n << " kind=" << kind;
        }
    }
    // NaNs leave some order, but stay inside the vector and keep the count.
    std::vector<float> w = randomFloats(3001, 4);
    Guarded<float> g(3001);
    g.load(w);
    ASSERT_EQ(z.zorsSortDescend_32f_I(g.p(), 3001), StatusOk);
    const auto out = g.get(3001);
    EXPECT_EQ(std::count_if(out.begin(), out.end(), [](float f) { return std::isnan(f); }),
              std::count_if(w.begin(), w.end(), [](float f) { return std::isnan(f); }));
}

namespace {
// The documented sort written plainly: median of three, the classic two-scan
// partition, the larger part stacked, runs of 9 or fewer finished by
// selection of the smallest to the end.  Equal elements (-0 and +0) and NaNs
// end where this sequence of swaps leaves them.
void referenceSortDescend(float* a, int n) {
    struct Range { int lo, hi; };
    std::vector<Range> stack;
    int lo = 0, hi = n - 1;
    for (;;) {
        while (hi - lo + 1 > 9) {
            const int mid = lo + (hi - lo) / 2;
            if (a[mid] > a[lo]) std::swap(a[lo], a[mid]);
            if (a[hi] > a[mid]) {
                std::swap(a[mid], a[hi]);
                if (a[mid] > a[lo]) std::swap(a[lo], a[mid]);
            }
            const float pivot = a[mid];
            int i = lo, j = hi;
            for (;;) {
                do ++i; while (a[i] > pivot);
                do --j; while (pivot > a[j]);
                if (i >= j) break;
                std::swap(a[i], a[j]);
            }
            if (j - lo < hi - j) {
                stack.push_back({j + 1, hi});
                hi = j;
            } else {
                stack.push_back({lo, j});
                lo = j + 1;
            }
        }
        for (int end = hi; end > lo; --end) {
            int m = lo;
            for (int k = lo + 1; k <= end; ++k)
                if (a[k] < a[m]) m = k;
            std::swap(a[m], a[end]);
        }
        if (stack.empty()) break;
        lo = stack.back().lo;
        hi = stack.back().hi;
        stack.pop_back();
    }
}
}  // namespace

// Signed zeros, NaNs and heavy duplication: the same bits as the plain
// algorithm, so the placement of elements that compare equal is fixed.
TEST_P(VecSortSplit, SortLeavesEqualElementsWhereTheDocumentedSwapsDo) {
    const Api& z = this->z();
    std::mt19937 rng(17);
    for (int trial = 0; trial < 300; ++trial) {
        const int n = 1 + static_cast<int>(rng() % (trial < 200 ? 150 : 3000));
        const int kind = trial % 4;
        std::vector<float> v(n);
        for (auto& x : v) {
            const uint32_t r = rng();
            x = kind == 0   ? (r % 3 == 0 ? 0.0f : r % 3 == 1 ? -0.0f : float(int(r % 5) - 2))
                : kind == 1 ? (r % 13 == 0 ? kNaN : float(int(r % 50)))
                : kind == 2 ? floatOf(r)
                            : (r % 2 ? 0.0f : -0.0f);
        }
        std::vector<float> want = v;
        referenceSortDescend(want.data(), n);
        Guarded<float> g(n, trial % 2 ? zt::Guard::After : zt::Guard::Before);
        g.load(v);
        ASSERT_EQ(z.zorsSortDescend_32f_I(g.p(), n), StatusOk);
        ASSERT_TRUE(sameBits(g.get(n), want)) << "n=" << n << " kind=" << kind;
    }
}

TEST_P(VecSortSplit, DeinterleaveSplitsChannelsAndWarnsOnAlignment) {
    const Api& z = this->z();
    const int len = 37;
    for (int ch : {1, 2, 3, 5}) {
        std::vector<int16_t> src(len * ch + 1);
        for (size_t i = 0; i < src.size(); ++i) src[i] = static_cast<int16_t>(i * 977 - 30000);
        int16_t* planes[5];
        for (int c = 0; c < ch; ++c) planes[c] = zorsMalloc_16s(len + 8);
        // Aligned source and destinations: OK.
        int16_t* asrc = zorsMalloc_16s(len * ch + 8);
        std::memcpy(asrc, src.data(), len * ch * sizeof(int16_t));
        EXPECT_EQ(z.zorsDeinterleave_16s(asrc, ch, len, planes), StatusOk);
        for (int c = 0; c < ch; ++c)
            for (int i = 0; i < len; ++i) ASSERT_EQ(planes[c][i], src[i * ch + c]) << ch;
        // An odd source address: the work is done, the warning returned.
        std::memcpy(asrc + 1, src.data(), len * ch * sizeof(int16_t));
        for (int c = 0; c < ch; ++c) std::memset(planes[c], 0, len * sizeof(int16_t));
        EXPECT_EQ(z.zorsDeinterleave_16s(asrc + 1, ch, len, planes), StatusWarnMisaligned);
        for (int c = 0; c < ch; ++c)
            for (int i = 0; i < len; ++i) ASSERT_EQ(planes[c][i], src[i * ch + c]) << ch;
        // A misaligned destination warns too.
        std::memcpy(asrc, src.data(), len * ch * sizeof(int16_t));
        int16_t* shifted[5];
        for (int c = 0; c < ch; ++c) shifted[c] = planes[c] + (c == ch - 1 ? 4 : 0);
        EXPECT_EQ(z.zorsDeinterleave_16s(asrc, ch, len, shifted), StatusWarnMisaligned);
        for (int i = 0; i < len; ++i) ASSERT_EQ(shifted[ch - 1][i], src[i * ch + ch - 1]);
        zorsFree(asrc);
        for (int c = 0; c < ch; ++c) zorsFree(planes[c]);
    }
    // Guarded planes, two channels (the dedicated path) and three.
    for (int ch : {2, 3}) {
        for (int n : {1, 7, 8, 9, 33}) {
            const auto src = randomShorts(n * ch, 2);
            Guarded<int16_t> gs(n * ch);
            gs.load(src);
            Guarded<int16_t> p0(n), p1(n), p2(n);
            int16_t* planes[3] = {p0.p(), p1.p(), p2.p()};
            const Status s = z.zorsDeinterleave_16s(gs.p(), ch, n, planes);
            EXPECT_TRUE(s == StatusOk || s == StatusWarnMisaligned);
            for (int c = 0; c < ch; ++c)
                for (int i = 0; i < n; ++i) ASSERT_EQ(planes[c][i], src[i * ch + c]);
        }
    }
    // Checks: pointers, channel count, length, then each plane.
    int16_t src[8] = {};
    Guarded<int16_t> g(8);
    int16_t* ok[2] = {g.p(), g.p()};
    int16_t* oneNull[2] = {g.p(), nullptr};
    EXPECT_EQ(z.zorsDeinterleave_16s(src, 0, 0, nullptr), StatusNullPointer);
    EXPECT_EQ(z.zorsDeinterleave_16s(nullptr, 2, 4, ok), StatusNullPointer);
    EXPECT_EQ(z.zorsDeinterleave_16s(src, 0, 0, ok), StatusBadChannelCount);
    EXPECT_EQ(z.zorsDeinterleave_16s(src, 2, 0, ok), StatusBadSize);
    EXPECT_EQ(z.zorsDeinterleave_16s(src, 2, 0, oneNull), StatusBadSize);
    EXPECT_EQ(z.zorsDeinterleave_16s(src, 2, 4, oneNull), StatusNullPointer);
    EXPECT_TRUE(g.untouched());
}

ZT_ALL_VARIANTS(VecArith);
ZT_ALL_VARIANTS(VecArith16);
ZT_ALL_VARIANTS(VecMath);
ZT_ALL_VARIANTS(VecSortSplit);
