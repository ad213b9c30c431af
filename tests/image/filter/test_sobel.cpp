// Sobel filters: kernels and signs, 3x3 and 5x5, saturation of the 8u form,
// the 32f row-pass rounding, border types, buffer sizes and check orders.
#include <algorithm>
#include <cstdint>
#include <limits>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"

namespace {

class Sobel : public zt::VariantTest {};

// The response at (x, y): smoothing [1 2 1] or [1 4 6 4 1] across, the
// difference [1 0 -1] or [1 2 0 -2 -1] along the direction; Vert takes
// differences along x, Horiz along y weighted -1 .. +1 from the top.
template <class Get>
double sobelRef(bool vert, int size, int x, int y, Get get) {
    static const int s3[3] = {1, 2, 1}, d3[3] = {1, 0, -1}, s5[5] = {1, 4, 6, 4, 1}, d5[5] = {1, 2, 0, -2, -1};
    const int r = size / 2, *smooth = r == 1 ? s3 : s5, *diff = r == 1 ? d3 : d5;
    double s = 0;
    for (int j = -r; j <= r; ++j)
        for (int i = -r; i <= r; ++i)
            s += (vert ? diff[i + r] * smooth[j + r] : -diff[j + r] * smooth[i + r]) * double(get(x + i, y + j));
    return s;
}

// Border rules: 0 replicate, 1 the constant (-1 here), 2 reflect about the
// edge pixel, 3 mirror including it, 4 wrap.
int borderIdx(int i, int n, int type) {
    while ((i < 0 || i >= n) && type != 1) {
        const bool low = i < 0;
        i = type == 0   ? (low ? 0 : n - 1)
            : type == 2 ? (n == 1 ? 0 : low ? -i : 2 * (n - 1) - i)
            : type == 3 ? (low ? -1 - i : 2 * n - 1 - i)
                        : (low ? i + n : i - n);
    }
    return i < 0 || i >= n ? -1 : i;
}

// The call's status, then every pixel of d against the kernel response
// (saturated for 8u); nothing written outside the ROI.
template <class T, class Get>
::testing::AssertionResult responds(Status status, const zt::GuardedImage<T>& d, bool vert, int size, Get get) {
    if (status != StatusOk) return ::testing::AssertionFailure() << "status " << status;
    for (int y = 0; y < d.height(); ++y)
        for (int x = 0; x < d.width(); ++x) {
            const double e = sobelRef(vert, size, x, y, get);
            if (*d.at(x, y) != T(std::is_same_v<T, uint8_t> ? std::clamp(e, 0.0, 255.0) : e))
                return ::testing::AssertionFailure() << (vert ? "vert " : "horiz ") << size << " at " << x << "," << y;
        }
    if (!d.outsideIntact()) return ::testing::AssertionFailure() << "wrote outside the ROI";
    return ::testing::AssertionSuccess();
}

// Plain, mask and 8u16s forms (type -1) read the border the mask needs,
// exactly that, against the guard page; the border forms (types 0 to 4)
// read only the ROI and make up the rest by the border rule, in a buffer of
// the reported size.  The float source is the 8u one less 100 (constant 77
// and -23), which leaves every response as it was (the weights sum to 0).
TEST_P(Sobel, FormsMatchTheKernels) {
    std::mt19937 rng(11);
    const auto& z = this->z();
    for (int size : {3, 5})
        for (ImageSize roi : {ImageSize{1, 1}, {3, 5}, {8, 2}, {9, 1}, {15, 4}, {17, 3}, {40, 5}, {131, 2}})
            for (int type = -1; type <= 4; ++type)
                for (bool vert : {false, true}) {
                    const int w = roi.width, h = roi.height, b = type < 0 ? size / 2 : 0, mask = size * 11;
                    const zt::Guard g = (w + vert) % 2 ? zt::Guard::Before : zt::Guard::After;
                    zt::GuardedImage<uint8_t> src(w, h, b, 0, g), d8(w, h, 0, 1);
                    zt::GuardedImage<float> sf(w, h, b, 0, g), df(w, h), dp(w, h);
                    zt::GuardedImage<int16_t> d(w, h, 0, 2);
                    src.fill([&](int, int) { return rng(); });
                    sf.fill([&](int x, int y) { return *src.at(x, y) - 100.0f; });
                    const auto get = [&](int x, int y) -> int {
                        const int sx = type < 0 ? x : borderIdx(x, w, type), sy = type < 0 ? y : borderIdx(y, h, type);
                        return type >= 0 && (sx < 0 || sy < 0) ? 77 : *src.at(sx, sy);
                    };
                    SCOPED_TRACE(::testing::Message() << "type " << type << ", roi " << w << "x" << h);
                    if (type >= 0) {
                        int n8 = 0, n32 = 0;
                        ASSERT_TRUE(z.zoriFilterSobelVertGetBufferSize_8u16s_C1R(roi, mask, &n8) == StatusOk &&
                                    z.zoriFilterSobelHorizGetBufferSize_32f_C1R(roi, mask, &n32) == StatusOk);
                        zt::GuardedBuffer buf{size_t(n8), g}, bf{size_t(n32)};
                        auto fn = vert ? z.zoriFilterSobelVertBorder_8u16s_C1R : z.zoriFilterSobelHorizBorder_8u16s_C1R;
                        auto ff = vert ? z.zoriFilterSobelVertBorder_32f_C1R : z.zoriFilterSobelHorizBorder_32f_C1R;
                        EXPECT_TRUE(responds(fn(src.roi(), src.step(), d.roi(), d.step(), roi, mask, type, 77, buf.data()), d,
                                             vert, size, get));
                        EXPECT_TRUE(responds(ff(sf.roi(), sf.step(), df.roi(), df.step(), roi, mask, type, -23.0f, bf.data()),
                                             df, vert, size, get));
                        continue;
                    }
                    auto fn = vert ? z.zoriFilterSobelVert_8u16s_C1R : z.zoriFilterSobelHoriz_8u16s_C1R;
                    EXPECT_TRUE(responds(fn(src.roi(), src.step(), d.roi(), d.step(), roi, mask), d, vert, size, get));
                    auto ff = vert ? z.zoriFilterSobelVertMask_32f_C1R : z.zoriFilterSobelHorizMask_32f_C1R;
                    for (int m : size == 3 ? std::vector<int>{33} : std::vector<int>{55, 44, 0, -1})  // 5x5 but 33
                        EXPECT_TRUE(responds(ff(sf.roi(), sf.step(), df.roi(), df.step(), roi, m), df, vert, size, get)) << m;
                    if (size == 5) continue;  // the plain forms: 3x3, the 8u one Horiz only and saturated
                    auto fp = vert ? z.zoriFilterSobelVert_32f_C1R : z.zoriFilterSobelHoriz_32f_C1R;
                    EXPECT_TRUE(responds(fp(sf.roi(), sf.step(), dp.roi(), dp.step(), roi), dp, vert, 3, get));
                    const auto f8 = z.zoriFilterSobelHoriz_8u_C1R;
                    EXPECT_TRUE(responds(f8(src.roi(), src.step(), d8.roi(), d8.step(), roi), d8, false, 3, get));
                }
}

// Each row-pass value is rounded to float before the column pass, and every
// variant gives the generic entry's bits on floats of mixed magnitude.
TEST_P(Sobel, FloatRowPassRoundsOnce) {
    const auto& z = this->z();
    // Horiz 3x3: row pass a + 2b + c along x, column pass bottom - top.
    // The bottom row's 2^24 + 1.5 rounds to 2^24 + 2; minus 0.5 is 2^24 + 1.5,
    // 2^24 + 2 again (keeping the row pass in double would give 2^24).
    float d = 0, img[3][3] = {{0.5f, 0, 0}, {0, 0, 0}, {16777216.0f, 0.5f, 0.5f}};
    ASSERT_EQ(z.zoriFilterSobelHoriz_32f_C1R(&img[1][1], 12, &d, 4, {1, 1}), StatusOk);
    EXPECT_EQ(d, 16777218.0f);
    // an infinite centre, under a zero weight of the row pass (Vert) or of
    // the column pass (Horiz), does not make NaN
    float v = 0, inf[3][3] = {{1, 0, 1}, {0, std::numeric_limits<float>::infinity(), 0}, {0, 0, 0}};
    ASSERT_TRUE(z.zoriFilterSobelVert_32f_C1R(&inf[1][1], 12, &v, 4, {1, 1}) == StatusOk &&
                z.zoriFilterSobelHoriz_32f_C1R(&inf[1][1], 12, &d, 4, {1, 1}) == StatusOk);
    EXPECT_TRUE(v == 0.0f && d == -2.0f) << v << " " << d;
    for (int mask : {33, 55})
        zt::agreesWithGeneric(variant(), [mask](const zt::Api& z, zt::Case& c) {
            const ImageSize r = c.roi();
            const auto s = c.inImage<float>(r.width + 4, r.height + 4);
            for (int i = 0; i < (r.height + 3) * s.step / 4 + r.width + 4; i += 3) s.p[i] *= 1e-6f;  // mixed magnitudes
            const auto h = c.outImage<float>(r.width, r.height), v = c.outImage<float>(r.width, r.height);
            const float* origin = reinterpret_cast<const float*>(reinterpret_cast<const uint8_t*>(s.p) + 2 * s.step) + 2;
            return z.zoriFilterSobelHorizMask_32f_C1R(origin, s.step, h.p, h.step, r, mask) +
                   z.zoriFilterSobelVertMask_32f_C1R(origin, s.step, v.p, v.step, r, mask);
        });
}

// Plain and mask forms: pointers, size, steps (not compared with the width),
// the mask; border forms: pointers (the buffer too), size, steps at least a
// row and even, the border type, the mask; buffer sizes as published.
TEST_P(Sobel, ChecksAndBufferSizes) {
    const auto& z = this->z();
    uint8_t s[256] = {}, buf[2048] = {};
    int16_t d[64] = {};
    float sf[64] = {}, df[64] = {};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)}, wf{zt::watch(df, sizeof df)}, w8{zt::watch(s + 100, 16)};
    const ImageSize roi{2, 2};
    zt::expectChecks(z.zoriFilterSobelHoriz_8u_C1R, {s + 40, 1, s + 100, 1, roi}, w8, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusBadStep, zt::arg<1>(0)), zt::bad(StatusBadStep, zt::arg<3>(-4)),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<4>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<1>(0), zt::arg<4>(ImageSize{0, 2})));
    zt::expectChecks(z.zoriFilterSobelVertMask_32f_C1R, {sf + 14, 24, df, 8, roi, 44}, wf, zt::eachNull(), zt::badRoi<4>());
    zt::expectChecks(z.zoriFilterSobelVert_8u16s_C1R, {s + 40, 20, d, 4, roi, 33}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusBadMaskSize, zt::arg<5>(44)), zt::bad(StatusBadMaskSize, zt::arg<5>(35)),
                     zt::bad(StatusBadStep, zt::arg<1>(0), zt::arg<5>(44)));
    for (auto fn : {z.zoriFilterSobelVertBorder_8u16s_C1R, z.zoriFilterSobelHorizBorder_8u16s_C1R})
        zt::expectChecks(fn, {s, 2, d, 4, roi, 33, 0, uint8_t(0), buf}, w, zt::eachNull(), zt::badRoi<4>(),
                         zt::bad(StatusBadStep, zt::arg<1>(1)), zt::bad(StatusBadStep, zt::arg<3>(3)),
                         zt::bad(StatusNotEvenStep, zt::arg<3>(5)), zt::bad(StatusBadArgument, zt::arg<6>(5)),
                         zt::bad(StatusBadArgument, zt::arg<6>(-1)), zt::bad(StatusBadMaskSize, zt::arg<5>(44)),
                         zt::bad(StatusNotEvenStep, zt::arg<3>(5), zt::arg<6>(9)),
                         zt::bad(StatusBadArgument, zt::arg<5>(44), zt::arg<6>(5)));
    for (auto fn : {z.zoriFilterSobelVertBorder_32f_C1R, z.zoriFilterSobelHorizBorder_32f_C1R})
        zt::expectChecks(fn, {sf, 8, df, 8, roi, 33, 0, 0.0f, buf}, wf, zt::eachNull(), zt::badRoi<4>(),
                         zt::bad(StatusBadStep, zt::arg<1>(7)), zt::bad(StatusNotEvenStep, zt::arg<1>(10)),
                         zt::bad(StatusNotEvenStep, zt::arg<3>(10)), zt::bad(StatusBadArgument, zt::arg<6>(7)),
                         zt::bad(StatusBadMaskSize, zt::arg<5>(53)));
    int n = 0;
    const struct { decltype(z.zoriFilterSobelVertGetBufferSize_8u16s_C1R) fn; ImageSize roi; int mask, size; } sizes[] = {
        {z.zoriFilterSobelHorizGetBufferSize_8u16s_C1R, {1, 1}, 33, 32 * 21 + 372},
        {z.zoriFilterSobelVertGetBufferSize_8u16s_C1R, {17, 3}, 55, 64 * 25 + 412},
        {z.zoriFilterSobelHorizGetBufferSize_32f_C1R, {1, 1}, 55, 16 * 25 + 420},
        {z.zoriFilterSobelVertGetBufferSize_32f_C1R, {5, 9}, 33, 32 * 21 + 364}};
    for (const auto& c : sizes) {
        EXPECT_TRUE(c.fn(c.roi, c.mask, &n) == StatusOk && n == c.size) << c.size;
        zt::expectChecks(c.fn, {c.roi, c.mask, &n}, {zt::watch(&n, sizeof n)}, zt::eachNull(), zt::badRoi<0>(),
                         zt::bad(StatusBadMaskSize, zt::arg<1>(44)), zt::bad(StatusBadSize, zt::arg<0>(ImageSize{0, 3}), zt::arg<1>(44)));
    }
}

}  // namespace

ZT_ALL_VARIANTS(Sobel);
