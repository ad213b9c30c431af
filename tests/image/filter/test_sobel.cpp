// Sobel filters: kernels and signs, 3x3 and 5x5, saturation of the 8u form,
// the 32f row-pass rounding, border types, buffer sizes and check orders.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Sobel : public zt::VariantTest {};

// Neighbourhood weight of (dx, dy) for a direction and size.
int weight(bool vert, int size, int dx, int dy) {
    static const int s3[3] = {1, 2, 1}, d3[3] = {1, 0, -1};
    static const int s5[5] = {1, 4, 6, 4, 1}, d5[5] = {1, 2, 0, -2, -1};
    const int r = size / 2;
    const int* smooth = size == 3 ? s3 : s5;
    const int* diff = size == 3 ? d3 : d5;
    if (vert) return diff[dx + r] * smooth[dy + r];
    return -diff[dy + r] * smooth[dx + r];  // Horiz: rows weighted -1 .. +1 from the top
}

// Reference at (x, y) with a pixel getter.
template <class Get>
double sobelRef(bool vert, int size, int x, int y, Get get) {
    const int r = size / 2;
    double s = 0;
    for (int dy = -r; dy <= r; ++dy)
        for (int dx = -r; dx <= r; ++dx) s += weight(vert, size, dx, dy) * double(get(x + dx, y + dy));
    return s;
}

TEST_P(Sobel, Ramps) {
    const auto& z = this->z();
    const int w = 20, h = 6;
    zt::GuardedImage<uint8_t> src(w, h, 2);
    src.fill([](int x, int) { return x + 10; });  // rises by one per column
    zt::GuardedImage<int16_t> d(w, h);
    ASSERT_EQ(z.zoriFilterSobelHoriz_8u16s_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h}, 33), StatusOk);
    EXPECT_EQ(*d.at(5, 3), 0);
    ASSERT_EQ(z.zoriFilterSobelVert_8u16s_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h}, 33), StatusOk);
    EXPECT_EQ(*d.at(5, 3), -8);
    EXPECT_EQ(*d.at(w - 1, h - 1), -8);
    ASSERT_EQ(z.zoriFilterSobelVert_8u16s_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h}, 55), StatusOk);
    EXPECT_EQ(*d.at(0, 0), -128);
    EXPECT_TRUE(d.outsideIntact());
    // 8u output: bright at the top, dark at the bottom -> every response negative -> 0
    zt::GuardedImage<uint8_t> v(w, h, 1);
    v.fill([](int, int y) { return 200 - 10 * y; });
    zt::GuardedImage<uint8_t> d8(w, h);
    ASSERT_EQ(z.zoriFilterSobelHoriz_8u_C1R(v.roi(), v.step(), d8.roi(), d8.step(), {w, h}), StatusOk);
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) ASSERT_EQ(*d8.at(x, y), 0);
    // and the other way round: 4 * 20 = 80 per pixel; steep steps saturate at 255
    v.fill([](int, int y) { return 10 * y + 50; });
    ASSERT_EQ(z.zoriFilterSobelHoriz_8u_C1R(v.roi(), v.step(), d8.roi(), d8.step(), {w, h}), StatusOk);
    EXPECT_EQ(*d8.at(3, 3), 80);
    v.fill([](int, int y) { return y > 2 ? 255 : 0; });
    ASSERT_EQ(z.zoriFilterSobelHoriz_8u_C1R(v.roi(), v.step(), d8.roi(), d8.step(), {w, h}), StatusOk);
    EXPECT_EQ(*d8.at(3, 2), 255);
    EXPECT_EQ(*d8.at(3, 0), 0);
}

TEST_P(Sobel, IntegerFormsMatchReference) {
    std::mt19937 rng(11 + variant());
    for (int size : {3, 5})
        for (int w : {1, 3, 8, 9, 17, 40})
            for (zt::Guard g : {zt::Guard::Before, zt::Guard::After}) {
                const int h = 5, r = size / 2;
                zt::GuardedImage<uint8_t> src(w, h, r, 0, g);  // exactly the border the mask reads
                src.fill([&](int, int) { return rng(); });
                auto get = [&](int x, int y) { return *src.at(x, y); };
                for (bool vert : {false, true}) {
                    zt::GuardedImage<int16_t> d(w, h, 0, 2);
                    auto fn = vert ? z().zoriFilterSobelVert_8u16s_C1R : z().zoriFilterSobelHoriz_8u16s_C1R;
                    ASSERT_EQ(fn(src.roi(), src.step(), d.roi(), d.step(), {w, h}, size * 11), StatusOk);
                    EXPECT_TRUE(d.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x)
                            ASSERT_EQ(*d.at(x, y), sobelRef(vert, size, x, y, get)) << size << vert << w;
                }
                if (size == 3) {
                    zt::GuardedImage<uint8_t> d(w, h, 0, 1);
                    ASSERT_EQ(z().zoriFilterSobelHoriz_8u_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h}), StatusOk);
                    EXPECT_TRUE(d.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x) {
                            const double e = sobelRef(false, 3, x, y, get);
                            ASSERT_EQ(*d.at(x, y), e <= 0 ? 0 : e > 255 ? 255 : int(e));
                        }
                }
            }
}

TEST_P(Sobel, FloatFormsMatchReference) {
    std::mt19937 rng(12 + variant());
    for (int size : {3, 5})
        for (int w : {1, 4, 13}) {
            const int h = 4, r = size / 2;
            zt::GuardedImage<float> src(w, h, r, 0, w % 2 ? zt::Guard::Before : zt::Guard::After);
            // eighths: every sum is exact
            src.fill([&](int, int) { return float(int(rng() % 2001) - 1000) / 8.0f; });
            auto get = [&](int x, int y) { return *src.at(x, y); };
            for (bool vert : {false, true}) {
                zt::GuardedImage<float> d(w, h);
                Status st;
                if (size == 3) {
                    st = vert ? z().zoriFilterSobelVert_32f_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h})
                              : z().zoriFilterSobelHoriz_32f_C1R(src.roi(), src.step(), d.roi(), d.step(), {w, h});
                    ASSERT_EQ(st, StatusOk);
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x) ASSERT_EQ(*d.at(x, y), float(sobelRef(vert, 3, x, y, get)));
                }
                // every mask but 33 is 5x5 in the 32f mask forms
                for (int mask : size == 3 ? std::vector<int>{33} : std::vector<int>{55, 44, 0, -1}) {
                    auto fn = vert ? z().zoriFilterSobelVertMask_32f_C1R : z().zoriFilterSobelHorizMask_32f_C1R;
                    ASSERT_EQ(fn(src.roi(), src.step(), d.roi(), d.step(), {w, h}, mask), StatusOk);
                    EXPECT_TRUE(d.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x)
                            ASSERT_EQ(*d.at(x, y), float(sobelRef(vert, size, x, y, get))) << mask;
                }
            }
        }
}

// Each row-pass value is rounded to float before the column pass.
TEST_P(Sobel, FloatRowPassRoundsOnce) {
    const auto& z = this->z();
    // Horiz 3x3: row pass a + 2b + c along x, column pass bottom - top.
    float img[3][3] = {{0.5f, 0, 0}, {0, 0, 0}, {16777216.0f, 0.5f, 0.5f}};
    float d = 0;
    ASSERT_EQ(z.zoriFilterSobelHoriz_32f_C1R(&img[1][1], 12, &d, 4, {1, 1}), StatusOk);
    // bottom row pass 2^24 + 1.5 -> 2^24 + 2 in float; minus 0.5 -> 2^24 + 1.5 -> 2^24 + 2
    // (keeping the row pass in double would give 2^24 + 1 -> 2^24)
    EXPECT_EQ(d, 16777218.0f);
    // infinite neighbours under zero weights do not make NaN
    float inf[3][3] = {{1, std::numeric_limits<float>::infinity(), 1}, {0, 0, 0}, {0, 0, 0}};
    ASSERT_EQ(z.zoriFilterSobelVert_32f_C1R(&inf[1][1], 12, &d, 4, {1, 1}), StatusOk);
    EXPECT_EQ(d, 0.0f);
}

TEST_P(Sobel, VariantsAgreeOnFloats) {
    std::mt19937 rng(13 + variant());
    const zt::Api& g = zt::api(0);
    std::uniform_real_distribution<float> u(-1000.0f, 1000.0f);
    const int w = 37, h = 5;
    zt::GuardedImage<float> src(w, h, 2, 4);
    src.fill([&](int, int) { return u(rng) * (rng() % 4 == 0 ? 1e-6f : 1.0f); });
    for (int mask : {33, 55})
        for (bool vert : {false, true}) {
            zt::GuardedImage<float> a(w, h), b(w, h);
            auto f1 = vert ? z().zoriFilterSobelVertMask_32f_C1R : z().zoriFilterSobelHorizMask_32f_C1R;
            auto f0 = vert ? g.zoriFilterSobelVertMask_32f_C1R : g.zoriFilterSobelHorizMask_32f_C1R;
            ASSERT_EQ(f1(src.roi(), src.step(), a.roi(), a.step(), {w, h}, mask), StatusOk);
            ASSERT_EQ(f0(src.roi(), src.step(), b.roi(), b.step(), {w, h}, mask), StatusOk);
            for (int y = 0; y < h; ++y) ASSERT_EQ(0, std::memcmp(a.at(0, y), b.at(0, y), w * 4));
        }
}

// Independent border rules.
int borderIdx(int i, int n, int type) {
    while (i < 0 || i >= n) {
        switch (type) {
        case 0: i = i < 0 ? 0 : n - 1; break;
        case 1: return -1;
        case 2: if (n == 1) return 0; i = i < 0 ? -i : 2 * (n - 1) - i; break;
        case 3: i = i < 0 ? -1 - i : 2 * n - 1 - i; break;
        default: i = i < 0 ? i + n : i - n; break;
        }
    }
    return i;
}

TEST_P(Sobel, BorderFormsSynthesiseFromTheRoiOnly) {
    std::mt19937 rng(14 + variant());
    for (int mask : {33, 55})
        for (int type = 0; type <= 4; ++type)
            for (ImageSize roi : {ImageSize{1, 1}, ImageSize{2, 3}, ImageSize{17, 4}, ImageSize{9, 1}}) {
                const int w = roi.width, h = roi.height;
                int size8 = 0, size32 = 0;
                ASSERT_EQ(zt::api(0).zoriFilterSobelVertGetBufferSize_8u16s_C1R(roi, mask, &size8), StatusOk);
                ASSERT_EQ(zt::api(0).zoriFilterSobelHorizGetBufferSize_32f_C1R(roi, mask, &size32), StatusOk);
                for (bool vert : {false, true}) {
                    // 8u16s: source with no border at all, guarded on one side
                    zt::GuardedImage<uint8_t> src(w, h, 0, 0, vert ? zt::Guard::Before : zt::Guard::After);
                    src.fill([&](int, int) { return rng(); });
                    const uint8_t bv = 77;
                    auto get = [&](int x, int y) -> int {
                        const int sx = borderIdx(x, w, type), sy = borderIdx(y, h, type);
                        return sx < 0 || sy < 0 ? bv : *src.at(sx, sy);
                    };
                    zt::GuardedBuffer buf{size_t(size8), vert ? zt::Guard::After : zt::Guard::Before};
                    zt::GuardedImage<int16_t> d(w, h);
                    auto fn = vert ? z().zoriFilterSobelVertBorder_8u16s_C1R : z().zoriFilterSobelHorizBorder_8u16s_C1R;
                    ASSERT_EQ(fn(src.roi(), src.step(), d.roi(), d.step(), roi, mask, type, bv, buf.data()), StatusOk);
                    EXPECT_TRUE(d.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x)
                            ASSERT_EQ(*d.at(x, y), sobelRef(vert, mask / 11, x, y, get))
                                << "type " << type << " mask " << mask << " at " << x << "," << y;
                    // 32f with the same pixels
                    zt::GuardedImage<float> sf(w, h, 0, 0, vert ? zt::Guard::After : zt::Guard::Before);
                    sf.fill([&](int x, int y) { return float(*src.at(x, y)) - 100.0f; });
                    auto getf = [&](int x, int y) -> double { return get(x, y) - 100.0; };
                    zt::GuardedBuffer bf{size_t(size32)};
                    zt::GuardedImage<float> df(w, h);
                    auto ff = vert ? z().zoriFilterSobelVertBorder_32f_C1R : z().zoriFilterSobelHorizBorder_32f_C1R;
                    ASSERT_EQ(ff(sf.roi(), sf.step(), df.roi(), df.step(), roi, mask, type, float(bv) - 100.0f, bf.data()),
                              StatusOk);
                    EXPECT_TRUE(df.outsideIntact());
                    for (int y = 0; y < h; ++y)
                        for (int x = 0; x < w; ++x) ASSERT_EQ(*df.at(x, y), float(sobelRef(vert, mask / 11, x, y, getf)));
                }
            }
}

TEST_P(Sobel, ChecksInOrder) {
    const auto& z = this->z();
    uint8_t s[256] = {}, buf[2048] = {};
    int16_t d[64] = {};
    float sf[64] = {}, df[64] = {};
    const ImageSize roi{2, 2};
    // plain and mask forms: null, size, step (not compared with the width), mask
    EXPECT_EQ(z.zoriFilterSobelHoriz_8u_C1R(nullptr, 0, s, 0, {0, 0}), StatusNullPointer);
    EXPECT_EQ(z.zoriFilterSobelHoriz_8u_C1R(s, 0, s, 0, {0, 2}), StatusBadSize);
    EXPECT_EQ(z.zoriFilterSobelHoriz_8u_C1R(s, 0, s, 4, roi), StatusBadStep);
    EXPECT_EQ(z.zoriFilterSobelVert_32f_C1R(sf, 4, df, 0, roi), StatusBadStep);
    EXPECT_EQ(z.zoriFilterSobelHoriz_32f_C1R(sf, 4, nullptr, 4, roi), StatusNullPointer);
    EXPECT_EQ(z.zoriFilterSobelVert_8u16s_C1R(s, 0, d, 4, roi, 44), StatusBadStep);
    EXPECT_EQ(z.zoriFilterSobelVert_8u16s_C1R(s + 40, 20, d, 4, roi, 44), StatusBadMaskSize);
    EXPECT_EQ(z.zoriFilterSobelHoriz_8u16s_C1R(s + 40, 20, d, 4, roi, 35), StatusBadMaskSize);
    EXPECT_EQ(z.zoriFilterSobelVertMask_32f_C1R(sf + 14, 24, df, 8, roi, 44), StatusOk);
    EXPECT_EQ(z.zoriFilterSobelHorizMask_32f_C1R(sf, 0, df, 8, roi, 44), StatusBadStep);
    // steps smaller than the row are accepted by the plain forms (rows overlap)
    EXPECT_EQ(z.zoriFilterSobelHoriz_8u_C1R(s + 40, 1, s + 100, 1, roi), StatusOk);
    // border forms
    auto vb = z.zoriFilterSobelVertBorder_8u16s_C1R;
    EXPECT_EQ(vb(s, 2, d, 4, roi, 33, 0, 0, nullptr), StatusNullPointer);
    EXPECT_EQ(vb(s, 2, d, 4, {2, 0}, 33, 0, 0, buf), StatusBadSize);
    EXPECT_EQ(vb(s, 1, d, 4, roi, 33, 0, 0, buf), StatusBadStep);
    EXPECT_EQ(vb(s, 2, d, 3, roi, 33, 0, 0, buf), StatusBadStep);
    EXPECT_EQ(vb(s, 2, d, 5, roi, 44, 9, 0, buf), StatusNotEvenStep);  // after the size test of the step
    EXPECT_EQ(vb(s, 2, d, 4, roi, 44, 5, 0, buf), StatusBadArgument);
    EXPECT_EQ(vb(s, 2, d, 4, roi, 44, -1, 0, buf), StatusBadArgument);
    EXPECT_EQ(vb(s, 2, d, 4, roi, 44, 4, 0, buf), StatusBadMaskSize);
    auto hb = z.zoriFilterSobelHorizBorder_32f_C1R;
    EXPECT_EQ(hb(sf, 7, df, 8, roi, 33, 0, 0, buf), StatusBadStep);
    EXPECT_EQ(hb(sf, 10, df, 8, roi, 33, 0, 0, buf), StatusNotEvenStep);
    EXPECT_EQ(hb(sf, 8, df, 10, roi, 33, 0, 0, buf), StatusNotEvenStep);
    EXPECT_EQ(hb(sf, 8, df, 8, roi, 33, 7, 0, buf), StatusBadArgument);
    EXPECT_EQ(hb(sf, 8, df, 8, roi, 53, 1, 0, buf), StatusBadMaskSize);
    for (int16_t v : d) EXPECT_EQ(v, 0);
    for (float v : df) EXPECT_EQ(v, 0.0f);
}

TEST_P(Sobel, BufferSizes) {
    const auto& z = this->z();
    int n = 0;
    for (auto fn : {z.zoriFilterSobelHorizGetBufferSize_8u16s_C1R, z.zoriFilterSobelVertGetBufferSize_8u16s_C1R}) {
        ASSERT_EQ(fn({1, 1}, 33, &n), StatusOk);
        EXPECT_EQ(n, 32 * 21 + 372);
        ASSERT_EQ(fn({17, 3}, 55, &n), StatusOk);
        EXPECT_EQ(n, 64 * 25 + 412);
        EXPECT_EQ(fn({0, 3}, 44, nullptr), StatusNullPointer);
        EXPECT_EQ(fn({0, 3}, 44, &n), StatusBadSize);
        EXPECT_EQ(fn({3, 3}, 44, &n), StatusBadMaskSize);
    }
    for (auto fn : {z.zoriFilterSobelHorizGetBufferSize_32f_C1R, z.zoriFilterSobelVertGetBufferSize_32f_C1R}) {
        ASSERT_EQ(fn({1, 1}, 55, &n), StatusOk);
        EXPECT_EQ(n, 16 * 25 + 420);
        ASSERT_EQ(fn({5, 9}, 33, &n), StatusOk);
        EXPECT_EQ(n, 32 * 21 + 364);
        EXPECT_EQ(fn({1, 0}, 33, &n), StatusBadSize);
        EXPECT_EQ(fn({1, 1}, 34, &n), StatusBadMaskSize);
    }
}

}  // namespace

ZT_ALL_VARIANTS(Sobel);
