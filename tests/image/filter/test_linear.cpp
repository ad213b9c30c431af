// Linear filters with a user kernel: convolution orientation, divisor modes,
// float rounding, check order, exact source bounds, variant agreement.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "frame/fpu.h"
#include "tests/support/agree.h"
#include "tests/support/checks.h"
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

// The extremes the random kernels do not reach: shift mode saturating, sums
// near the 32-bit limits (exact products, no overflow in the scaling), a sum
// that wraps in 32 bits, the divisor -2^31 (1 for sums <= -2^30, else 0).
TEST_P(LinearFilter, DivisorModesAtTheExtremes) {
    const auto& z = this->z();
    const int divMin = std::numeric_limits<int32_t>::min();
    const struct { uint8_t px; int32_t k; int divisor; uint8_t want; } cases[] = {
        {255, 1 << 22, 1 << 20, 255}, {255, 8421504, 1 << 30, 2}, {255, 8421504, 3, 255},
        {255, -8421504, -16777216, 128}, {128, -(1 << 23), divMin, 1}, {127, -(1 << 23), divMin, 0},
        {128, 1 << 23, divMin, 0}, {6, 1, 4, 2}, {6, -1, 4, 0}, {7, -1, -1, 7}};
    for (const auto& c : cases) EXPECT_EQ(one8u(z, c.px, c.k, c.divisor), c.want) << c.k << " / " << c.divisor;
    const uint8_t px[2] = {255, 255};
    const int32_t k[2] = {8421504, 8421504};  // 2 * 255 * 8421504 = 4294967040 wraps to -256
    uint8_t d = 9;
    ASSERT_EQ(z.zoriFilter_8u_C1R(px + 1, 2, &d, 1, {1, 1}, k, {2, 1}, {0, 0}, -1), StatusOk);
    EXPECT_EQ(d, 255);  // -256 / -1 = 256, saturated
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

// Rounded half away from zero (8u: negatives and NaN to 0), saturated.
template <class T>
T floatRef(const TightSource<T>& s, int x, int y, const std::vector<float>& k, ImageSize ks, ImagePoint a) {
    zor::DoublePrecisionScope fpu;
    double sum = kernelSumRef(s, x, y, k, ks, a);
    const double lo = std::numeric_limits<T>::min(), hi = std::numeric_limits<T>::max();
    if (sum > 0) sum = zor::toDouble(sum + 0.5);
    else if (sum < 0 && lo < 0) sum = zor::toDouble(sum - 0.5);
    if (sum > hi) return T(hi);
    if (!(sum >= lo)) return T(sum != sum ? 0 : lo);
    return T(int(sum));
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
                            ASSERT_EQ(*dst.at(x, y), floatRef(src, x, y, k, ks, a))
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
                        ASSERT_EQ(*dst.at(x, y), floatRef(src, x, y, k, ks, a))
                            << "kind " << kind << " k " << sh.kw << "x" << sh.kh << " w " << w << " at " << x << ","
                            << y;
                // the integer 16s form is the float form with each coefficient
                // float(k) * float(1 / divisor) rounded to float
                std::vector<int32_t> ki(k.size());
                std::vector<float> kd(k.size());
                const int divisor = kind % 2 ? -3 : 45;
                for (size_t i = 0; i < k.size(); ++i) {
                    ki[i] = int32_t(rng() % 2001) - 1000;
                    volatile double p = double(float(ki[i])) * double(float(1.0 / divisor));
                    kd[i] = float(p);
                }
                zt::GuardedImage<int16_t> di(w, h), df(w, h);
                ASSERT_EQ(z().zoriFilter_16s_C1R(src.roi(), src.step(), di.roi(), di.step(), {w, h}, ki.data(), ks, a,
                                                 divisor), StatusOk);
                ASSERT_EQ(z().zoriFilter32f_16s_C1R(src.roi(), src.step(), df.roi(), df.step(), {w, h}, kd.data(), ks, a),
                          StatusOk);
                for (int y = 0; y < h; ++y) ASSERT_EQ(0, std::memcmp(di.at(0, y), df.at(0, y), 2 * size_t(w)));
            }
        }
}

// Single sums: half up for 8u (NaN and negatives to 0), half away from zero
// for 16s, saturated.
TEST_P(LinearFilter, FloatRounding) {
    const auto& z = this->z();
    const float nan = std::numeric_limits<float>::quiet_NaN(), inf = std::numeric_limits<float>::infinity();
    const struct { uint8_t px; float k; uint8_t want; } c8[] = {
        {2, 127.25f, 255}, {1, 254.49f, 254}, {3, 0.5f, 2}, {1, -0.4f, 0}, {1, 300.0f, 255}, {1, nan, 0}, {1, inf, 255}};
    for (const auto& c : c8) {
        uint8_t d = 77;
        ASSERT_EQ(z.zoriFilter32f_8u_C1R(&c.px, 1, &d, 1, {1, 1}, &c.k, {1, 1}, {0, 0}), StatusOk);
        EXPECT_EQ(d, c.want) << c.k;
    }
    const struct { int16_t px; float k; int16_t want; } c16[] = {
        {5, -0.5f, -3}, {5, 0.5f, 3}, {1, -0.49f, 0}, {30000, 2.0f, 32767}, {30000, -2.0f, -32768}, {1, nan, 0}};
    for (const auto& c : c16) {
        int16_t d = 77;
        ASSERT_EQ(z.zoriFilter32f_16s_C1R(&c.px, 2, &d, 2, {1, 1}, &c.k, {1, 1}, {0, 0}), StatusOk);
        EXPECT_EQ(d, c.want) << c.k;
    }
}

// Pointers (the kernel too), sizes (the kernel's too), the divisor, then
// steps that must hold a source row of width + kW - 1 samples and a
// destination row; the 16s integer form checks its kernel first.
TEST_P(LinearFilter, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[128] = {}, d[64] = {};
    int16_t s16[64] = {}, d16[64] = {};
    const int32_t k[9] = {1, 1, 1, 1, 1, 1, 1, 1, 1};
    const float kf[9] = {};
    const ImageSize ks{3, 3}, roi{4, 2};
    const ImagePoint a{1, 1};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)}, w16{zt::watch(d16, sizeof d16)};
    for (int c : {1, 3})
        zt::expectChecks(c == 1 ? z.zoriFilter_8u_C1R : z.zoriFilter_8u_C3R, {s + 7 * c, 6 * c, d, 4 * c, roi, k, ks, a, 1},
                         w, zt::eachNull(), zt::badRoi<4>(), zt::badRoi<6>(), zt::bad(StatusBadDivisor, zt::arg<8>(0)),
                         zt::bad(StatusBadStep, zt::arg<1>(6 * c - 1)), zt::bad(StatusBadStep, zt::arg<3>(4 * c - 1)),
                         zt::bad(StatusNullPointer, zt::arg<5>(nullptr), zt::arg<6>(ImageSize{0, 0}), zt::arg<8>(0)),
                         zt::bad(StatusBadSize, zt::arg<6>(ImageSize{3, 0}), zt::arg<8>(0)),
                         zt::bad(StatusBadDivisor, zt::arg<1>(0), zt::arg<3>(0), zt::arg<8>(0)));
    for (int c : {1, 3})
        zt::expectChecks(c == 1 ? z.zoriFilter32f_8u_C1R : z.zoriFilter32f_8u_C3R, {s + 7 * c, 6 * c, d, 4 * c, roi, kf, ks, a},
                         w, zt::eachNull(), zt::badRoi<4>(), zt::badRoi<6>(), zt::bad(StatusBadStep, zt::arg<1>(6 * c - 1)),
                         zt::bad(StatusBadStep, zt::arg<3>(4 * c - 1)),
                         zt::bad(StatusBadSize, zt::arg<1>(0), zt::arg<4>(ImageSize{0, 2})));
    zt::expectChecks(z.zoriFilter32f_16s_C1R, {s16 + 7, 12, d16, 8, roi, kf, ks, a}, w16, zt::eachNull(),
                     zt::badRoi<4>(), zt::badRoi<6>(), zt::bad(StatusBadStep, zt::arg<1>(11)),
                     zt::bad(StatusBadStep, zt::arg<3>(7)));
    zt::expectChecks(z.zoriFilter_16s_C1R, {s16 + 7, 12, d16, 8, roi, k, ks, a, 1}, w16, zt::eachNull(),
                     zt::badRoi<4>(), zt::badRoi<6>(), zt::bad(StatusBadDivisor, zt::arg<8>(0)),
                     zt::bad(StatusBadStep, zt::arg<1>(11)),
                     zt::bad(StatusBadSize, zt::arg<0>(nullptr), zt::arg<6>(ImageSize{0, 3})),
                     zt::bad(StatusBadDivisor, zt::arg<0>(nullptr), zt::arg<8>(0)),
                     zt::bad(StatusNullPointer, zt::arg<5>(nullptr), zt::arg<6>(ImageSize{0, 3})));
}

// Variants agree bit for bit with the generic one on non-dyadic kernels,
// wide and narrow coefficient ranges (the narrow ones take exact integer
// paths), large sums, unaligned rows.
TEST_P(LinearFilter, VariantsAgreeWithGeneric) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        auto& rng = c.rng();
        const ImageSize r = c.roi(), ks{1 + int(rng() % 6), 1 + int(rng() % 6)};
        const ImagePoint a{int(rng() % ks.width), int(rng() % ks.height)};
        const int ch = c.index() % 2 ? 3 : 1, divisor = c.index() % 5 == 0 ? 1000 : c.index() % 3 ? 45 : -3;
        std::vector<int32_t> k(size_t(ks.width * ks.height));
        std::vector<float> kf(k.size()), kn(k.size());
        for (size_t i = 0; i < k.size(); ++i) {
            k[i] = c.index() % 3 == 0 ? int32_t(rng() % 200001) - 100000 : int32_t(rng() % 61) - 20;
            kf[i] = float(k[i]) / 45.0f;
            kn[i] = float(int(rng() % 13) - 3) / (c.index() % 2 ? 45.0f : 7.0f);
        }
        const auto s = c.inImage<uint8_t>((r.width + ks.width) * ch, r.height + ks.height);
        const auto s16 = c.inImage<int16_t>(r.width + ks.width, r.height + ks.height);
        const uint8_t* o = s.p + (ks.height - 1 - a.y) * s.step + (ks.width - 1 - a.x) * ch;
        const int16_t* o16 = reinterpret_cast<const int16_t*>(reinterpret_cast<const uint8_t*>(s16.p) +
                                                              (ks.height - 1 - a.y) * s16.step) + ks.width - 1 - a.x;
        const auto d1 = c.outImage<uint8_t>(r.width * ch, r.height), d2 = c.outImage<uint8_t>(r.width * ch, r.height),
                   d3 = c.outImage<uint8_t>(r.width * ch, r.height);
        const auto e = c.outImage<int16_t>(r.width, r.height);
        return (ch == 1 ? z.zoriFilter_8u_C1R : z.zoriFilter_8u_C3R)(o, s.step, d1.p, d1.step, r, k.data(), ks, a, divisor) +
               (ch == 1 ? z.zoriFilter32f_8u_C1R : z.zoriFilter32f_8u_C3R)(o, s.step, d2.p, d2.step, r, kf.data(), ks, a) +
               (ch == 1 ? z.zoriFilter32f_8u_C1R : z.zoriFilter32f_8u_C3R)(o, s.step, d3.p, d3.step, r, kn.data(), ks, a) +
               z.zoriFilter_16s_C1R(o16, s16.step, e.p, e.step, r, k.data(), ks, a, 45);
    });
}

}  // namespace

ZT_ALL_VARIANTS(LinearFilter);
