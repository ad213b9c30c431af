// Linear filters with a user kernel: convolution orientation, divisor modes,
// float rounding, check order, exact source bounds, variant agreement.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "frame/fpu.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class LinearFilter : public zt::VariantTest {};

// A source holding exactly the neighbourhood of a w x h ROI (kernel kw x kh,
// c channels), rows packed at the minimum step, flush against a guard page
// on one side.  roi() points at the ROI's first sample.
template <class T>
struct TightSource {
    TightSource(int w, int h, ImageSize ks, ImagePoint anchor, int c, zt::Guard g)
        : rowLen((w + ks.width - 1) * c), rows(h + ks.height - 1), c(c),
          buf(sizeof(T) * size_t(rowLen) * size_t(rows), g),
          left((ks.width - 1 - anchor.x) * c), up(ks.height - 1 - anchor.y) {}
    int step() const { return rowLen * int(sizeof(T)); }
    T* base() const { return buf.as<T>(); }
    T* roi() const { return base() + size_t(up) * rowLen + left; }
    // sample (x, y) relative to the ROI, x counting samples
    T& at(int x, int y) const { return roi()[ptrdiff_t(y) * rowLen + x]; }
    int rowLen, rows, c;
    zt::GuardedBuffer buf;
    int left, up;
};

// The exact convolution sum at sample (x, y), in 64 bits.
template <class T, class K>
double sumRef(const TightSource<T>& s, int x, int y, const std::vector<K>& k, ImageSize ks,
              ImagePoint a) {
    double sum = 0;
    for (int j = 0; j < ks.height; ++j)
        for (int i = 0; i < ks.width; ++i)
            sum += double(k[j * ks.width + i]) * double(s.at(x + (a.x - i) * s.c, y + a.y - j));
    return sum;
}

uint8_t scaleRef(int64_t sum, int divisor) {
    const int32_t s = static_cast<int32_t>(static_cast<uint32_t>(sum));  // wraps like the library
    if (divisor == 1) return uint8_t(s < 0 ? 0 : s > 255 ? 255 : s);
    double q = double(s) * double(float(1.0 / divisor));  // exact for the sums used here
    if (!(q > 0)) return 0;
    q = std::floor(q + 0.5);
    return uint8_t(q > 255 ? 255 : q);
}

struct Shape {
    int kw, kh, ax, ay;
};

const Shape kShapes[] = {{1, 1, 0, 0}, {2, 1, 0, 0}, {3, 3, 1, 1}, {5, 5, 2, 2}, {4, 2, 3, 0},
                         {3, 5, 0, 4}, {5, 5, 0, 0}, {7, 3, 6, 2}, {3, 3, -1, 4}};

TEST_P(LinearFilter, IntegerKernel8uMatchesReference) {
    std::mt19937 rng(1234 + variant());
    for (int c : {1, 3})
        for (const Shape& sh : kShapes)
            for (int w : {1, 5, 16, 17, 40})
                for (int divisor : {1, 4, 64, 3, 45, -1, -7}) {
                    const ImageSize ks{sh.kw, sh.kh};
                    const ImagePoint a{sh.ax, sh.ay};
                    const int h = 3;
                    std::vector<int32_t> k(size_t(sh.kw * sh.kh));
                    // small coefficients in half the cases (16-bit sums suffice then)
                    for (auto& v : k) v = w % 2 ? int32_t(rng() % 41) - 12 : int32_t(rng() % 9) - 3;
                    for (zt::Guard g : {zt::Guard::Before, zt::Guard::After}) {
                        TightSource<uint8_t> src(w, h, ks, a, c, g);
                        for (int i = 0; i < src.rowLen * src.rows; ++i) src.base()[i] = uint8_t(rng());
                        zt::GuardedImage<uint8_t> dst(w * c, h);
                        auto fn = c == 1 ? z().zoriFilter_8u_C1R : z().zoriFilter_8u_C3R;
                        ASSERT_EQ(fn(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, k.data(),
                                     ks, a, divisor),
                                  StatusOk);
                        ASSERT_TRUE(dst.outsideIntact());
                        for (int y = 0; y < h; ++y)
                            for (int x = 0; x < w * c; ++x)
                                ASSERT_EQ(*dst.at(x, y),
                                          scaleRef(int64_t(sumRef(src, x, y, k, ks, a)), divisor))
                                    << "c " << c << " k " << sh.kw << "x" << sh.kh << " w " << w
                                    << " div " << divisor << " at " << x << "," << y;
                    }
                }
}

// Each output is one sum: a 1x1 kernel {coefficient} over chosen pixels.
uint8_t one8u(const zt::Api& z, uint8_t pixel, int32_t coefficient, int divisor) {
    uint8_t d = 77;
    const int32_t k = coefficient;
    EXPECT_EQ(z.zoriFilter_8u_C1R(&pixel, 1, &d, 1, {1, 1}, &k, {1, 1}, {0, 0}, divisor), StatusOk);
    return d;
}

TEST_P(LinearFilter, DivisorModesRoundHalfUpAndDropNonPositive) {
    const auto& z = this->z();
    EXPECT_EQ(one8u(z, 6, 1, 4), 2);
    EXPECT_EQ(one8u(z, 5, 1, 4), 1);
    EXPECT_EQ(one8u(z, 0, 1, 4), 0);
    EXPECT_EQ(one8u(z, 6, -1, 4), 0);
    EXPECT_EQ(one8u(z, 4, 1, 3), 1);
    EXPECT_EQ(one8u(z, 5, 1, 3), 2);
    EXPECT_EQ(one8u(z, 7, -1, -1), 7);
    EXPECT_EQ(one8u(z, 7, 1, -1), 0);
    EXPECT_EQ(one8u(z, 255, 3, 1), 255);
    EXPECT_EQ(one8u(z, 255, -3, 1), 0);
    EXPECT_EQ(one8u(z, 255, 1 << 22, 1 << 20), 255);  // shift mode saturates
    // sums near the 32-bit limits: exact products, no overflow in the scaling
    EXPECT_EQ(one8u(z, 255, 8421504, 1 << 30), 2);          // 2147483520 / 2^30 = 1.99999988
    EXPECT_EQ(one8u(z, 255, 8421504, 3), 255);
    EXPECT_EQ(one8u(z, 255, -8421504, -16777216), 128);    // 2147483520 / 2^24 = 127.99999
    // the sum wraps in 32 bits: 2 * 255 * 8421504 = 4294967040 -> -256
    {
        const uint8_t px[2] = {255, 255};
        const int32_t k[2] = {8421504, 8421504};
        uint8_t d = 9;
        ASSERT_EQ(z.zoriFilter_8u_C1R(px + 1, 2, &d, 1, {1, 1}, k, {2, 1}, {0, 0}, -1), StatusOk);
        EXPECT_EQ(d, 255);  // -256 / -1 = 256, saturated
    }
    // divisor -2^31: 1 for sums <= -2^30, 0 otherwise
    const int divMin = std::numeric_limits<int32_t>::min();
    EXPECT_EQ(one8u(z, 128, -(1 << 23), divMin), 1);
    EXPECT_EQ(one8u(z, 127, -(1 << 23), divMin), 0);
    EXPECT_EQ(one8u(z, 128, 1 << 23, divMin), 0);
}

TEST_P(LinearFilter, KernelIsFlipped) {
    const auto& z = this->z();
    // kernel {1, 2}, anchor (0, 0): dst(x) = src(x) + 2 src(x - 1)
    const uint8_t src[4] = {10, 20, 30, 40};
    const int32_t k[2] = {1, 2};
    uint8_t dst[3] = {};
    ASSERT_EQ(z.zoriFilter_8u_C1R(src + 1, 4, dst, 3, {3, 1}, k, {2, 1}, {0, 0}, 1), StatusOk);
    EXPECT_EQ(dst[0], 20 + 2 * 10);
    EXPECT_EQ(dst[2], 40 + 2 * 30);
    // vertically too: kernel column {1, 2}, anchor (0, 0): dst(y) = src(y) + 2 src(y - 1)
    uint8_t d2 = 0;
    ASSERT_EQ(z.zoriFilter_8u_C1R(src + 1, 1, &d2, 1, {1, 1}, k, {1, 2}, {0, 0}, 1), StatusOk);
    EXPECT_EQ(d2, 20 + 2 * 10);
    // 1x1 identity copies
    uint8_t d3[4] = {};
    const int32_t one = 1;
    ASSERT_EQ(z.zoriFilter_8u_C1R(src, 4, d3, 4, {4, 1}, &one, {1, 1}, {0, 0}, 1), StatusOk);
    EXPECT_EQ(0, std::memcmp(src, d3, 4));
}

TEST_P(LinearFilter, FloatKernelsMatchReference) {
    std::mt19937 rng(99 + variant());
    for (const Shape& sh : kShapes)
        for (int w : {1, 7, 16, 21}) {
            const ImageSize ks{sh.kw, sh.kh};
            const ImagePoint a{sh.ax, sh.ay};
            const int h = 2;
            // dyadic coefficients: every sum is exact, whatever the precision
            std::vector<float> k(size_t(sh.kw * sh.kh));
            for (auto& v : k) v = float(int(rng() % 81) - 30) / 64.0f;
            for (int c : {1, 3}) {
                TightSource<uint8_t> src(w, h, ks, a, c, zt::Guard::After);
                for (int i = 0; i < src.rowLen * src.rows; ++i) src.base()[i] = uint8_t(rng());
                zt::GuardedImage<uint8_t> dst(w * c, h);
                auto fn = c == 1 ? z().zoriFilter32f_8u_C1R : z().zoriFilter32f_8u_C3R;
                ASSERT_EQ(fn(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, k.data(), ks, a),
                          StatusOk);
                EXPECT_TRUE(dst.outsideIntact());
                for (int y = 0; y < h; ++y)
                    for (int x = 0; x < w * c; ++x) {
                        double s = sumRef(src, x, y, k, ks, a);
                        if (s > 0) s += 0.5;
                        const int e = s > 255 ? 255 : s < 0 ? 0 : int(s);
                        ASSERT_EQ(*dst.at(x, y), e) << x << "," << y;
                    }
            }
            TightSource<int16_t> s16(w, h, ks, a, 1, zt::Guard::Before);
            for (int i = 0; i < s16.rowLen * s16.rows; ++i) s16.base()[i] = int16_t(rng());
            zt::GuardedImage<int16_t> d16(w, h);
            ASSERT_EQ(z().zoriFilter32f_16s_C1R(s16.roi(), s16.step(), d16.roi(), d16.step(), {w, h},
                                                k.data(), ks, a),
                      StatusOk);
            EXPECT_TRUE(d16.outsideIntact());
            // the integer 16s form with divisor 64 uses the same coefficients
            std::vector<int32_t> ki(k.size());
            for (size_t i = 0; i < k.size(); ++i) ki[i] = int32_t(k[i] * 64);
            zt::GuardedImage<int16_t> e16(w, h);
            ASSERT_EQ(z().zoriFilter_16s_C1R(s16.roi(), s16.step(), e16.roi(), e16.step(), {w, h},
                                             ki.data(), ks, a, 64),
                      StatusOk);
            for (int y = 0; y < h; ++y)
                for (int x = 0; x < w; ++x) {
                    double s = sumRef(s16, x, y, k, ks, a);
                    s = s > 0 ? s + 0.5 : s < 0 ? s - 0.5 : s;
                    const int e = s > 32767 ? 32767 : s < -32768 ? -32768 : int(s);
                    ASSERT_EQ(*d16.at(x, y), e);
                    ASSERT_EQ(*e16.at(x, y), e);
                }
        }
}

// The float-kernel 8u result as defined: the sum accumulated in double in
// neighbourhood order (top row first, left to right, the kernel read
// backwards), then half up, NaN and negatives to 0, saturated.
// The caller holds a DoublePrecisionScope.
template <class T>
double kernelSumRef(const TightSource<T>& s, int x, int y, const std::vector<float>& k, ImageSize ks,
                    ImagePoint a) {
    double sum = 0;
    const int n = ks.width * ks.height;
    for (int r = 0; r < ks.height; ++r)
        for (int q = 0; q < ks.width; ++q) {
            const double p = s.at(x + (q - (ks.width - 1 - a.x)) * s.c, y + r - (ks.height - 1 - a.y));
            sum = zor::toDouble(sum + p * double(k[size_t(n - 1 - r * ks.width - q)]));
        }
    return sum;
}

uint8_t float8uRef(const TightSource<uint8_t>& s, int x, int y, const std::vector<float>& k, ImageSize ks,
                   ImagePoint a) {
    zor::DoublePrecisionScope fpu;
    double sum = kernelSumRef(s, x, y, k, ks, a);
    if (sum > 0) sum = zor::toDouble(sum + 0.5);
    if (sum > 255) return 255;
    if (!(sum >= 0)) return 0;
    return uint8_t(int(sum));
}

int16_t float16sRef(const TightSource<int16_t>& s, int x, int y, const std::vector<float>& k, ImageSize ks,
                    ImagePoint a) {
    zor::DoublePrecisionScope fpu;
    double sum = kernelSumRef(s, x, y, k, ks, a);
    if (sum > 0) sum = zor::toDouble(sum + 0.5);
    if (sum < 0) sum = zor::toDouble(sum - 0.5);
    if (sum > 32767) return 32767;
    if (sum < -32768) return -32768;
    if (sum != sum) return 0;
    return int16_t(int(sum));
}

// Kernels and pictures whose sums sit on or next to a half, far apart
// magnitudes, negative and non-finite coefficients: the fast paths must
// settle each of these exactly like the double loop.
TEST_P(LinearFilter, FloatKernel8uExactNearHalves) {
    std::mt19937 rng(31 + variant());
    const float inf = std::numeric_limits<float>::infinity(), nan = std::numeric_limits<float>::quiet_NaN();
    enum Kind { Halves, NearHalves, Ninths, Mixed, Negative, Large, Tiny, NonFinite, Count };
    for (int kind = 0; kind < Count; ++kind)
        for (const Shape& sh : {Shape{5, 5, 2, 2}, Shape{3, 3, 1, 1}, Shape{4, 3, 0, 2}, Shape{1, 6, 0, 5}}) {
            const ImageSize ks{sh.kw, sh.kh};
            const ImagePoint a{sh.ax, sh.ay};
            std::vector<float> k(size_t(sh.kw * sh.kh));
            for (size_t i = 0; i < k.size(); ++i) {
                const float u = float(int(rng() % 9) - 2);
                switch (kind) {
                case Halves: k[i] = 0.5f; break;                                 // sums: n.0 and n.5
                case NearHalves: k[i] = 0.5f + (rng() % 2 ? 1.0f : -1.0f) * 0x1p-22f; break;
                case Ninths: k[i] = u / 9.0f; break;
                case Mixed: k[i] = rng() % 2 ? u * 0x1p-30f : u / 7.0f; break;   // wide exponent range
                case Negative: k[i] = -u / 3.0f + 0.25f; break;
                case Large: k[i] = u * 1000.25f; break;
                case Tiny: k[i] = u * 1e-7f + (rng() % 3 == 0 ? 1e-40f : 0.0f); break;  // subnormals too
                default: k[i] = u / 5.0f; break;
                }
            }
            if (kind == NonFinite) k[rng() % k.size()] = rng() % 2 ? inf : nan;
            // symmetric rows in half the cases (the vector path adds mirrored rows first)
            if (rng() % 2)
                for (int r = 0; r < sh.kh / 2; ++r)
                    for (int q = 0; q < sh.kw; ++q)
                        k[size_t((sh.kh - 1 - r) * sh.kw + q)] = k[size_t(r * sh.kw + q)];
            for (int c : {1, 3})
                for (int w : {16, 23, 40}) {
                    const int h = 3;
                    TightSource<uint8_t> src(w, h, ks, a, c, w % 2 ? zt::Guard::After : zt::Guard::Before);
                    for (int i = 0; i < src.rowLen * src.rows; ++i)
                        src.base()[i] = kind == Halves || kind == NearHalves ? uint8_t(rng() % 4 ? rng() % 24 : 255)
                                                                             : uint8_t(rng());
                    zt::GuardedImage<uint8_t> dst(w * c, h);
                    auto fn = c == 1 ? z().zoriFilter32f_8u_C1R : z().zoriFilter32f_8u_C3R;
                    ASSERT_EQ(fn(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, k.data(), ks, a), StatusOk);
                    ASSERT_TRUE(dst.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w * c; ++x)
                            ASSERT_EQ(*dst.at(x, y), float8uRef(src, x, y, k, ks, a))
                                << "kind " << kind << " k " << sh.kw << "x" << sh.kh << " c " << c << " w " << w
                                << " at " << x << "," << y;
                }
            // the same kernels on 16-bit samples, rounded half away from zero
            for (int w : {3, 8, 19}) {
                const int h = 2;
                TightSource<int16_t> src(w, h, ks, a, 1, w % 2 ? zt::Guard::After : zt::Guard::Before);
                for (int i = 0; i < src.rowLen * src.rows; ++i)
                    src.base()[i] = int16_t(rng() % 3 ? int(rng() % 64) - 32 : int(rng() % 65536) - 32768);
                zt::GuardedImage<int16_t> dst(w, h);
                ASSERT_EQ(z().zoriFilter32f_16s_C1R(src.roi(), src.step(), dst.roi(), dst.step(), {w, h}, k.data(),
                                                    ks, a),
                          StatusOk);
                ASSERT_TRUE(dst.outsideIntact());
                for (int y = 0; y < h; ++y)
                    for (int x = 0; x < w; ++x)
                        ASSERT_EQ(*dst.at(x, y), float16sRef(src, x, y, k, ks, a))
                            << "kind " << kind << " k " << sh.kw << "x" << sh.kh << " w " << w << " at " << x << ","
                            << y;
            }
        }
}

TEST_P(LinearFilter, FloatRounding) {
    const auto& z = this->z();
    auto one = [&](uint8_t px, float coefficient) {
        uint8_t d = 77;
        EXPECT_EQ(z.zoriFilter32f_8u_C1R(&px, 1, &d, 1, {1, 1}, &coefficient, {1, 1}, {0, 0}), StatusOk);
        return d;
    };
    EXPECT_EQ(one(2, 127.25f), 255);  // 254.5 rounds up
    EXPECT_EQ(one(1, 254.49f), 254);
    EXPECT_EQ(one(1, -0.4f), 0);
    EXPECT_EQ(one(1, 300.0f), 255);
    EXPECT_EQ(one(1, std::numeric_limits<float>::quiet_NaN()), 0);
    EXPECT_EQ(one(1, std::numeric_limits<float>::infinity()), 255);
    auto one16 = [&](int16_t px, float coefficient) {
        int16_t d = 77;
        EXPECT_EQ(z.zoriFilter32f_16s_C1R(&px, 2, &d, 2, {1, 1}, &coefficient, {1, 1}, {0, 0}), StatusOk);
        return d;
    };
    EXPECT_EQ(one16(5, -0.5f), -3);
    EXPECT_EQ(one16(5, 0.5f), 3);
    EXPECT_EQ(one16(1, -0.49f), 0);
    EXPECT_EQ(one16(30000, 2.0f), 32767);
    EXPECT_EQ(one16(30000, -2.0f), -32768);
    EXPECT_EQ(one16(1, std::numeric_limits<float>::quiet_NaN()), 0);
    // the 16s integer form: 5 * (1/2) = 2.5 -> 3, -2.5 -> -3; 5 * float(1/3) -> 2
    int16_t px = 5, d = 0;
    const int32_t kp = 1, kn = -1;
    ASSERT_EQ(z.zoriFilter_16s_C1R(&px, 2, &d, 2, {1, 1}, &kp, {1, 1}, {0, 0}, 2), StatusOk);
    EXPECT_EQ(d, 3);
    ASSERT_EQ(z.zoriFilter_16s_C1R(&px, 2, &d, 2, {1, 1}, &kn, {1, 1}, {0, 0}, 2), StatusOk);
    EXPECT_EQ(d, -3);
    ASSERT_EQ(z.zoriFilter_16s_C1R(&px, 2, &d, 2, {1, 1}, &kp, {1, 1}, {0, 0}, 3), StatusOk);
    EXPECT_EQ(d, 2);
}

TEST_P(LinearFilter, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[128] = {}, d[64] = {}, okDst[64] = {};
    int16_t s16[64] = {}, d16[64] = {};
    const int32_t k[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
    const float kf[9] = {};
    const ImageSize ks{3, 3}, roi{4, 2};
    const ImagePoint a{1, 1};
    for (auto fn : {z.zoriFilter_8u_C1R, z.zoriFilter_8u_C3R}) {
        const int c = fn == z.zoriFilter_8u_C1R ? 1 : 3;
        EXPECT_EQ(fn(s, 18, d, 12, roi, nullptr, {0, 0}, a, 0), StatusNullPointer);
        EXPECT_EQ(fn(nullptr, 18, d, 12, roi, k, ks, a, 1), StatusNullPointer);
        EXPECT_EQ(fn(s, 18, nullptr, 12, roi, k, ks, a, 1), StatusNullPointer);
        EXPECT_EQ(fn(s, 0, d, 0, {0, 2}, k, ks, a, 0), StatusBadSize);
        EXPECT_EQ(fn(s, 0, d, 0, roi, k, {3, 0}, a, 0), StatusBadSize);
        EXPECT_EQ(fn(s, 0, d, 0, roi, k, ks, a, 0), StatusBadDivisor);
        EXPECT_EQ(fn(s, 6 * c - 1, d, 4 * c, roi, k, ks, a, 1), StatusBadStep);
        EXPECT_EQ(fn(s, 6 * c, d, 4 * c - 1, roi, k, ks, a, 1), StatusBadStep);
        EXPECT_EQ(fn(s + 6 * c + c, 6 * c, okDst, 4 * c, roi, k, ks, a, 1), StatusOk);  // exact steps
    }
    EXPECT_EQ(z.zoriFilter32f_8u_C1R(s, 5, d, 4, roi, kf, ks, a), StatusBadStep);
    EXPECT_EQ(z.zoriFilter32f_8u_C3R(s, 18, d, 11, roi, kf, ks, a), StatusBadStep);
    EXPECT_EQ(z.zoriFilter32f_8u_C1R(nullptr, 0, d, 0, {0, 0}, kf, ks, a), StatusNullPointer);
    EXPECT_EQ(z.zoriFilter32f_16s_C1R(s16, 11, d16, 8, roi, kf, ks, a), StatusBadStep);
    EXPECT_EQ(z.zoriFilter32f_16s_C1R(s16, 12, d16, 7, roi, kf, ks, a), StatusBadStep);
    EXPECT_EQ(z.zoriFilter32f_16s_C1R(s16 + 7, 12, d16 + 32, 8, roi, kf, ks, a), StatusOk);
    // the 16s integer form checks the kernel, its size and the divisor first
    EXPECT_EQ(z.zoriFilter_16s_C1R(nullptr, 0, nullptr, 0, {0, 0}, nullptr, ks, a, 0), StatusNullPointer);
    EXPECT_EQ(z.zoriFilter_16s_C1R(nullptr, 0, nullptr, 0, {0, 0}, k, {0, 3}, a, 0), StatusBadSize);
    EXPECT_EQ(z.zoriFilter_16s_C1R(nullptr, 0, nullptr, 0, {0, 0}, k, ks, a, 0), StatusBadDivisor);
    EXPECT_EQ(z.zoriFilter_16s_C1R(nullptr, 0, d16, 8, roi, k, ks, a, 1), StatusNullPointer);
    EXPECT_EQ(z.zoriFilter_16s_C1R(s16, 12, d16, 8, {0, 2}, k, ks, a, 1), StatusBadSize);
    EXPECT_EQ(z.zoriFilter_16s_C1R(s16, 11, d16, 8, roi, k, ks, a, 1), StatusBadStep);
    // nothing written on failure
    for (uint8_t v : d) EXPECT_EQ(v, 0);
    for (int i = 0; i < 32; ++i) EXPECT_EQ(d16[i], 0);
}

// Variants agree bit for bit with the generic one on non-dyadic kernels and
// large sums, unaligned rows.
TEST_P(LinearFilter, VariantsAgreeWithGeneric) {
    std::mt19937 rng(7 + variant());
    const zt::Api& g = zt::api(0);
    for (int trial = 0; trial < 12; ++trial) {
        const int kw = 1 + int(rng() % 6), kh = 1 + int(rng() % 6);
        const int w = 1 + int(rng() % 70), h = 1 + int(rng() % 4);
        const int c = trial % 2 ? 3 : 1;
        const ImagePoint a{int(rng() % kw), int(rng() % kh)};
        const int border = 6;
        zt::GuardedImage<uint8_t> src(w * c, h, border * c, 3);
        src.fill([&](int, int) { return rng(); });
        std::vector<int32_t> k(size_t(kw * kh));
        std::vector<float> kf(k.size());
        const bool large = trial % 3 == 0;
        for (size_t i = 0; i < k.size(); ++i) {
            k[i] = large ? int32_t(rng() % 200001) - 100000 : int32_t(rng() % 61) - 20;
            kf[i] = float(k[i]) / 45.0f;
        }
        for (int divisor : {45, 7, 1000, -3, 16}) {
            zt::GuardedImage<uint8_t> d1(w * c, h, 0, 1), d2(w * c, h, 0, 1);
            auto f1 = c == 1 ? z().zoriFilter_8u_C1R : z().zoriFilter_8u_C3R;
            auto f0 = c == 1 ? g.zoriFilter_8u_C1R : g.zoriFilter_8u_C3R;
            ASSERT_EQ(f1(src.roi(), src.step(), d1.roi(), d1.step(), {w, h}, k.data(), {kw, kh}, a, divisor), StatusOk);
            ASSERT_EQ(f0(src.roi(), src.step(), d2.roi(), d2.step(), {w, h}, k.data(), {kw, kh}, a, divisor), StatusOk);
            for (int y = 0; y < h; ++y)
                ASSERT_EQ(0, std::memcmp(d1.at(0, y), d2.at(0, y), size_t(w * c))) << divisor;
        }
        // wide and narrow coefficient ranges (the narrow ones take an exact integer path)
        std::vector<float> kn(k.size());
        for (auto& v : kn) v = float(int(rng() % 13) - 3) / (trial % 2 ? 45.0f : 7.0f);
        for (const auto* kk : {&kf, &kn}) {
            zt::GuardedImage<uint8_t> d1(w * c, h), d2(w * c, h);
            auto f1 = c == 1 ? z().zoriFilter32f_8u_C1R : z().zoriFilter32f_8u_C3R;
            auto f0 = c == 1 ? g.zoriFilter32f_8u_C1R : g.zoriFilter32f_8u_C3R;
            ASSERT_EQ(f1(src.roi(), src.step(), d1.roi(), d1.step(), {w, h}, kk->data(), {kw, kh}, a), StatusOk);
            ASSERT_EQ(f0(src.roi(), src.step(), d2.roi(), d2.step(), {w, h}, kk->data(), {kw, kh}, a), StatusOk);
            for (int y = 0; y < h; ++y) ASSERT_EQ(0, std::memcmp(d1.at(0, y), d2.at(0, y), size_t(w * c)));
        }

        zt::GuardedImage<int16_t> s16(w, h, border, 2);
        s16.fill([&](int, int) { return rng(); });
        zt::GuardedImage<int16_t> e1(w, h), e2(w, h);
        ASSERT_EQ(z().zoriFilter_16s_C1R(s16.roi(), s16.step(), e1.roi(), e1.step(), {w, h}, k.data(), {kw, kh}, a, 45), StatusOk);
        ASSERT_EQ(g.zoriFilter_16s_C1R(s16.roi(), s16.step(), e2.roi(), e2.step(), {w, h}, k.data(), {kw, kh}, a, 45), StatusOk);
        for (int y = 0; y < h; ++y) ASSERT_EQ(0, std::memcmp(e1.at(0, y), e2.at(0, y), size_t(w) * 2));
    }
}

}  // namespace

ZT_ALL_VARIANTS(LinearFilter);
