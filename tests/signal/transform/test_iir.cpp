// IIR state, normalisation, transposed direct form II with float delays.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <random>
#include <vector>

#include "frame/memory.h"
#include "tests/support/variants.h"

namespace {

class Iir : public zt::VariantTest {};

// Independent model: taps normalised in double, each sample in double in the
// documented order, delays rounded to float between samples.
std::vector<float> model(const std::vector<float>& taps, int order, std::vector<float>& d,
                         const std::vector<float>& x) {
    const double r = 1.0 / static_cast<double>(taps[order + 1]);
    std::vector<float> b(order + 1), a(order + 1);
    for (int i = 0; i <= order; ++i) b[i] = static_cast<float>(taps[i] * r);
    for (int i = 1; i <= order; ++i) a[i] = static_cast<float>(taps[order + 1 + i] * r);
    std::vector<float> y(x.size());
    for (size_t j = 0; j < x.size(); ++j) {
        volatile double xv = x[j];
        volatile double yv = double(b[0]) * xv + double(d[0]);
        for (int i = 0; i + 1 < order; ++i) {
            volatile double t = double(b[i + 1]) * xv;
            volatile double u = double(a[i + 1]) * yv;
            volatile double v = t - u;
            volatile double w = v + double(d[i + 1]);
            d[i] = static_cast<float>(w);
        }
        volatile double t = double(b[order]) * xv;
        volatile double u = double(a[order]) * yv;
        volatile double v = t - u;
        d[order - 1] = static_cast<float>(v);
        y[j] = static_cast<float>(yv);
    }
    return y;
}

std::vector<float> noise(size_t n, unsigned seed, float lo = -1, float hi = 1) {
    std::mt19937 g(seed);
    std::uniform_real_distribution<float> u(lo, hi);
    std::vector<float> v(n);
    for (float& f : v) f = u(g);
    return v;
}

TEST_P(Iir, ImpulseAndNormalisation) {
    for (auto taps : {std::vector<float>{1, 0, 1, -0.5f}, std::vector<float>{2, 0, 2, -1}}) {
        void* st = nullptr;
        ASSERT_EQ(z().zorsIIRInitAlloc_32f(&st, taps.data(), 1, nullptr), StatusOk);
        float x[6] = {1, 0, 0, 0, 0, 0}, y[6];
        ASSERT_EQ(z().zorsIIR_32f(x, y, 6, st), StatusOk);
        float e = 1;
        for (float v : y) {
            EXPECT_EQ(v, e);
            e *= 0.5f;
        }
        EXPECT_EQ(z().zorsIIRFree_32f(st), StatusOk);
    }
}

TEST_P(Iir, MatchesModelAcrossOrdersAndBlocks) {
    for (int order : {1, 2, 3, 4, 5, 8, 9, 13}) {
        // a stable-ish filter: small feedback taps
        std::vector<float> taps = noise(2 * order + 2, order, -0.3f, 0.3f);
        taps[order + 1] = 1.25f;
        const auto dly0 = noise(order, 100 + order);
        const auto x = noise(301, 7 * order);
        std::vector<float> d = dly0;
        const auto want = model(taps, order, d, x);

        void* st = nullptr;
        ASSERT_EQ(z().zorsIIRInitAlloc_32f(&st, taps.data(), order, dly0.data()), StatusOk);
        std::vector<float> y(x.size());
        // blocks of uneven sizes, one of them in place
        size_t pos = 0;
        for (int len : {1, 10, 4, 6, 97, 183}) {
            if (len == 97) {
                std::memcpy(y.data() + pos, x.data() + pos, len * 4);
                ASSERT_EQ(z().zorsIIR_32f(y.data() + pos, y.data() + pos, len, st), StatusOk);
            } else {
                ASSERT_EQ(z().zorsIIR_32f(x.data() + pos, y.data() + pos, len, st), StatusOk);
            }
            pos += len;
        }
        ASSERT_EQ(pos, x.size());
        EXPECT_EQ(0, std::memcmp(y.data(), want.data(), y.size() * 4)) << "order " << order;
        EXPECT_EQ(z().zorsIIRFree_32f(st), StatusOk);
    }
}

TEST_P(Iir, ChecksAndStatuses) {
    const auto& a = z();
    float taps[4] = {1, 0, 0, -0.5f};
    void* st = nullptr;
    EXPECT_EQ(a.zorsIIRInitAlloc_32f(nullptr, taps, 0, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsIIRInitAlloc_32f(&st, nullptr, 1, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsIIRInitAlloc_32f(&st, taps, 0, nullptr), StatusBadFilterOrder);
    EXPECT_EQ(a.zorsIIRInitAlloc_32f(&st, taps, 1, nullptr), StatusDivideByZero);
    taps[2] = NAN;
    EXPECT_EQ(a.zorsIIRInitAlloc_32f(&st, taps, 1, nullptr), StatusDivideByZero);
    EXPECT_EQ(st, nullptr);
    taps[2] = 1;
    ASSERT_EQ(a.zorsIIRInitAlloc_32f(&st, taps, 1, nullptr), StatusOk);
    float x[3] = {1, 2, 3}, y[3] = {7, 7, 7};
    EXPECT_EQ(a.zorsIIR_32f(nullptr, y, 0, st), StatusNullPointer);
    EXPECT_EQ(a.zorsIIR_32f(x, y, 3, nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsIIR_32f(x, y, 0, st), StatusBadSize);
    // another object's record is refused
    void* g = nullptr;
    ASSERT_EQ(a.zorsRandGaussInitAlloc_32f(&g, 0, 1, 1), StatusOk);
    EXPECT_EQ(a.zorsIIR_32f(x, y, 3, g), StatusContextMismatch);
    EXPECT_EQ(a.zorsIIRFree_32f(g), StatusContextMismatch);
    EXPECT_EQ(y[0], 7.0f);
    EXPECT_EQ(a.zorsRandGaussFree_32f(g), StatusOk);
    // the record as published: identifier, order, reserved, allocated
    struct Rec { uint32_t id; float* taps; float* dly; int32_t order, reserved, allocated; };
    Rec r;
    std::memcpy(&r, st, sizeof r);
    EXPECT_EQ(r.id, 0x49493031u);
    EXPECT_EQ(r.order, 1);
    EXPECT_EQ(r.allocated, 1);
    EXPECT_EQ(r.dly[1], 0.0f);
    EXPECT_EQ(a.zorsIIRFree_32f(nullptr), StatusNullPointer);
    EXPECT_EQ(a.zorsIIRFree_32f(st), StatusOk);
    // the biquad kind: filtering refused, free accepted (nothing to release
    // when the caller owns the memory)
    Rec q{0x49493032u, nullptr, nullptr, 2, 0, 0};
    EXPECT_EQ(a.zorsIIR_32f(x, y, 3, &q), StatusContextMismatch);
    EXPECT_EQ(a.zorsIIRFree_32f(&q), StatusOk);
}

void* failingAlloc(size_t) { return nullptr; }

TEST_P(Iir, AllocationFailure) {
    zor::mem::rawAlloc = failingAlloc;
    float taps[4] = {1, 0, 1, -0.5f};
    void* st = nullptr;
    const Status s = z().zorsIIRInitAlloc_32f(&st, taps, 1, nullptr);
    zor::mem::rawAlloc = std::malloc;
    EXPECT_EQ(s, StatusNoMemory);
    EXPECT_EQ(st, nullptr);
}

ZT_ALL_VARIANTS(Iir);

}  // namespace
