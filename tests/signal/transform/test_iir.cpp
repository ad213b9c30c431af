// IIR state, normalisation, transposed direct form II with float delays.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Iir : public zt::VariantTest {};

// The definition: taps normalised by a0 in double (rounded to float), then
// per sample y = b0 x + d0, d_i = (b_(i+1) x - a_(i+1) y) + d_(i+1) and
// d_(N-1) = b_N x - a_N y, in double, the delays rounded to float.
std::vector<float> filtered(const std::vector<float>& taps, int order, std::vector<float> d, std::vector<float> x) {
    const double r = 1.0 / static_cast<double>(taps[order + 1]);
    std::vector<double> t(taps.size());  // b0 .. bN, 1, a1 .. aN
    for (size_t i = 0; i < t.size(); ++i) t[i] = static_cast<float>(taps[i] * r);
    for (float& xj : x) {
        volatile double y = t[0] * xj + d[0];
        for (int i = 0; i < order; ++i) {
            volatile double p = t[i + 1] * xj, q = t[order + 2 + i] * y, v = p - q;
            volatile double w = i + 1 < order ? v + double(d[i + 1]) : double(v);
            d[i] = static_cast<float>(w);
        }
        xj = static_cast<float>(y);
    }
    return x;
}

// The state record as published: identifier, taps, delays (one spare 0),
// order, reserved, allocated.
struct Rec { uint32_t id; float* taps; float* dly; int32_t order, reserved, allocated; };

// Orders with their own kernel and the general one, a0 normalised away,
// uneven blocks (one in place) carrying the delays; order 9 starts from no
// delay line, which means zeros.
TEST_P(Iir, MatchesTheDefinitionAcrossOrdersAndBlocks) {
    for (int order : {1, 2, 3, 5, 8, 9, 13}) {
        std::vector<float> taps = zt::randomFloats(2 * order + 2, order, 0.3f);  // small feedback: stable
        taps[order + 1] = 1.25f;
        const auto dly = order == 9 ? std::vector<float>(9) : zt::randomFloats(order, 100 + order, 1.0f);
        const auto x = zt::randomFloats(301, 7 * order, 1.0f), want = filtered(taps, order, dly, x);
        void* st = nullptr;
        ASSERT_EQ(z().zorsIIRInitAlloc_32f(&st, taps.data(), order, order == 9 ? nullptr : dly.data()), StatusOk);
        const Rec& r = *static_cast<const Rec*>(st);
        EXPECT_TRUE(r.id == 0x49493031u && r.order == order && r.allocated == 1 && r.dly[order] == 0.0f);
        std::vector<float> y = x;
        size_t pos = 0;
        for (int len : {1, 10, 4, 6, 97, 183}) {
            ASSERT_EQ(z().zorsIIR_32f((len == 97 ? y : x).data() + pos, y.data() + pos, len, st), StatusOk);
            pos += len;
        }
        EXPECT_EQ(0, std::memcmp(y.data(), want.data(), y.size() * 4)) << "order " << order;
        EXPECT_EQ(z().zorsIIRFree_32f(st), StatusOk);
    }
}

// A zero or NaN a0 divides by zero; filtering checks pointers, length, then
// the record's kind (another object, or the biquad kind, which has no
// filter here but frees).
TEST_P(Iir, ChecksAndStatuses) {
    const zt::Api& a = z();
    float taps[4] = {1, 0, 1, -0.5f}, zero[4] = {1, 0, 0, -0.5f}, nan[4] = {1, 0, NAN, -0.5f};
    void* st = nullptr;
    zt::expectChecks(a.zorsIIRInitAlloc_32f, {&st, taps, 1, nullptr}, {zt::watch(&st, sizeof st)},
                     zt::eachNull(StatusNullPointer, {3}), zt::bad(StatusBadFilterOrder, zt::arg<2>(0)),
                     zt::bad(StatusDivideByZero, zt::arg<1>(zero)), zt::bad(StatusDivideByZero, zt::arg<1>(nan)));
    float x[3] = {1, 2, 3}, y[3] = {7, 7, 7};
    Rec other{0x12345678u, nullptr, nullptr, 2, 0, 0}, biquads{0x49493032u, nullptr, nullptr, 2, 0, 0};
    zt::expectChecks(a.zorsIIR_32f, {x, y, 3, st}, {zt::watch(y, sizeof y)}, zt::eachNull(), zt::badLength<2>(),
                     zt::bad(StatusContextMismatch, zt::arg<3>(&other)), zt::bad(StatusContextMismatch, zt::arg<3>(&biquads)),
                     zt::bad(StatusBadSize, zt::arg<2>(0), zt::arg<3>(&other)));
    EXPECT_EQ(a.zorsIIRFree_32f(&other), StatusContextMismatch);
    EXPECT_EQ(a.zorsIIRFree_32f(&biquads), StatusOk);
    EXPECT_EQ(a.zorsIIRFree_32f(st), StatusOk);
}

ZT_ALL_VARIANTS(Iir);

}  // namespace
