// Gaussian generator: the exact sequence from a model of its recurrences.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <vector>

#include "tests/support/variants.h"

namespace {

class RandGauss : public zt::VariantTest {};

// Straight from the recurrences: uniforms from subtract-with-borrow plus
// congruential generators, normal values by the polar method.
struct Model {
    uint32_t lcg = 1131199209u, a, b, c;
    int32_t borrow = -1;
    double mean, sd;
    std::vector<double> queue;
    Model(float m, float s, uint32_t seed) : mean(m), sd(s) {
        a = seed;
        b = seed * 69069u + 1013904243u;
        c = b * 69069u + 1013904243u;
    }
    static double asUniform(uint32_t v) {
        volatile double u = 4.656612873077e-10 * static_cast<int32_t>(v);
        return u;
    }
    void draw(double& u1, double& u2) {
        uint32_t lcg1 = lcg * 69069u + 1013904243u;
        uint32_t lcg2 = lcg1 * 69069u + 1013904243u;
        uint32_t t = b - c + static_cast<uint32_t>(borrow);
        const bool neg = static_cast<int32_t>(t) < 0;
        uint32_t tp = neg ? t - 18 : t;
        u1 = asUniform(tp + lcg1);
        uint32_t s = a - b - (neg ? 1u : 0u);
        uint32_t an = s;
        if (static_cast<int32_t>(s) < 0) {
            borrow = -1;
            an = s - 18;
        } else {
            borrow = 0;
        }
        c = a;
        b = tp;
        a = an;
        lcg = lcg2;
        u2 = asUniform(a + lcg);
    }
    float next() {
        if (queue.empty()) {
            double u1, u2, q;
            for (;;) {
                draw(u1, u2);
                volatile double x = u1 * u1, y = u2 * u2;
                volatile double sum = x + y;
                q = sum;
                if (q < 1 && q != 0) break;
            }
            volatile double l = -2.0 * std::log(q);
            volatile double r = l / q;
            volatile double f = std::sqrt(r);
            volatile double k = sd * f;
            volatile double e2 = k * u2 + mean;
            volatile double e1 = k * u1 + mean;
            queue.push_back(double(e1));
            queue.push_back(double(e2));
        }
        const double v = queue.back();
        queue.pop_back();
        return static_cast<float>(v);
    }
};

TEST_P(RandGauss, ExactSequenceAcrossCalls) {
    for (uint32_t seed : {0u, 1u, 12345u, 0xFFFFFFFFu}) {
        Model m(1.5f, 0.75f, seed);
        void* st = nullptr;
        ASSERT_EQ(z().zorsRandGaussInitAlloc_32f(&st, 1.5f, 0.75f, seed), StatusOk);
        std::vector<float> got;
        for (int len : {1, 1, 3, 64, 5, 1000, 2}) {
            std::vector<float> part(len);
            ASSERT_EQ(z().zorsRandGauss_32f(part.data(), len, st), StatusOk);
            got.insert(got.end(), part.begin(), part.end());
        }
        for (size_t i = 0; i < got.size(); ++i) {
            const float want = m.next();
            ASSERT_EQ(std::memcmp(&got[i], &want, 4), 0) << "seed " << seed << " at " << i;
        }
        EXPECT_EQ(z().zorsRandGaussFree_32f(st), StatusOk);
    }
}

TEST_P(RandGauss, StatisticsAndConstantCases) {
    void* st = nullptr;
    ASSERT_EQ(z().zorsRandGaussInitAlloc_32f(&st, -2.0f, 3.0f, 99), StatusOk);
    std::vector<float> v(20000);
    ASSERT_EQ(z().zorsRandGauss_32f(v.data(), 20000, st), StatusOk);
    double s = 0, s2 = 0;
    for (float x : v) { s += x; s2 += double(x) * x; }
    const double mean = s / v.size(), var = s2 / v.size() - mean * mean;
    EXPECT_NEAR(mean, -2.0, 0.1);
    EXPECT_NEAR(std::sqrt(var), 3.0, 0.1);
    EXPECT_EQ(z().zorsRandGaussFree_32f(st), StatusOk);

    ASSERT_EQ(z().zorsRandGaussInitAlloc_32f(&st, 0.1f, 0.0f, 5), StatusOk);
    float w[7];
    ASSERT_EQ(z().zorsRandGauss_32f(w, 7, st), StatusOk);
    for (float x : w) EXPECT_EQ(x, 0.1f);
    // the published state: identifier 40, the seed, the congruential start
    uint32_t words[5];
    std::memcpy(words, st, sizeof words);
    EXPECT_EQ(words[0], 40u);
    EXPECT_EQ(words[1], 5u);
    EXPECT_EQ(z().zorsRandGaussFree_32f(st), StatusOk);

    void* fresh = nullptr;
    ASSERT_EQ(z().zorsRandGaussInitAlloc_32f(&fresh, 0, 1, 77), StatusOk);
    std::memcpy(words, fresh, sizeof words);
    EXPECT_EQ(words[4], 1131199209u);
    EXPECT_EQ(z().zorsRandGaussFree_32f(fresh), StatusOk);
}

TEST_P(RandGauss, Checks) {
    const auto& a = z();
    EXPECT_EQ(a.zorsRandGaussInitAlloc_32f(nullptr, 0, 1, 1), StatusNullPointer);
    void* st = nullptr;
    ASSERT_EQ(a.zorsRandGaussInitAlloc_32f(&st, 0, 1, 1), StatusOk);
    float x[2] = {9, 9};
    EXPECT_EQ(a.zorsRandGauss_32f(nullptr, 0, st), StatusNullPointer);
    EXPECT_EQ(a.zorsRandGauss_32f(x, 2, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsRandGauss_32f(x, 0, st), StatusBadSize);
    void* spec = nullptr;
    ASSERT_EQ(a.zorsFFTInitAlloc_C_32f(&spec, 3, 8, 0), StatusOk);
    EXPECT_EQ(a.zorsRandGauss_32f(x, 2, spec), StatusContextMismatch);
    EXPECT_EQ(a.zorsRandGaussFree_32f(spec), StatusContextMismatch);
    EXPECT_EQ(x[0], 9.0f);
    EXPECT_EQ(a.zorsFFTFree_C_32f(spec), StatusOk);
    EXPECT_EQ(a.zorsRandGaussFree_32f(nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsRandGaussFree_32f(st), StatusOk);
}

ZT_ALL_VARIANTS(RandGauss);

}  // namespace
