// The fixed-size adapters equal their general functions on the same
// variant, outputs and statuses, the Dy forms whatever their extra argument.
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Adapters : public zt::VariantTest {};

TEST_P(Adapters, EqualTheGeneralFunctions) {
    const auto& z = this->z();
    std::mt19937 rng(9);
    const int w = 13, h = 6;
    zt::GuardedImage<uint8_t> s8(w, h, 1);
    zt::GuardedImage<float> sf(w, h, 1);
    s8.fill([&](int, int) { return rng(); });
    sf.fill([&](int, int) { return float(int(rng() % 2000) - 1000) / 7; });
    for (ImageSize roi : {ImageSize{w, h}, ImageSize{w, 0}}) {  // the second fails in the general function
        std::vector<int16_t> a(w * h), b(w * h);
        std::vector<float> c(w * h), d(w * h);
        EXPECT_EQ(z.zoriSobel3x3_Dx_8u16s_C1R(s8.roi(), s8.step(), a.data(), 2 * w, roi),
                  z.zoriFilterSobelVert_8u16s_C1R(s8.roi(), s8.step(), b.data(), 2 * w, roi, 33));
        EXPECT_EQ(z.zoriSobel3x3_Dx_32f_C1R(sf.roi(), sf.step(), c.data(), 4 * w, roi),
                  z.zoriFilterSobelVertMask_32f_C1R(sf.roi(), sf.step(), d.data(), 4 * w, roi, 33));
        EXPECT_TRUE(a == b && c == d);
        for (int extra : {0, -1, 55, 1 << 30}) {
            EXPECT_EQ(z.zoriSobel3x3_Dy_8u16s_C1R(s8.roi(), s8.step(), a.data(), 2 * w, extra, roi),
                      z.zoriFilterSobelHoriz_8u16s_C1R(s8.roi(), s8.step(), b.data(), 2 * w, roi, 33));
            EXPECT_EQ(z.zoriSobel3x3_Dy_32f_C1R(sf.roi(), sf.step(), c.data(), 4 * w, extra, roi),
                      z.zoriFilterSobelHorizMask_32f_C1R(sf.roi(), sf.step(), d.data(), 4 * w, roi, 33));
            EXPECT_TRUE(a == b && c == d) << extra;
        }
    }
    // 3 x 3 with rows 32 bytes apart: strides 32 and 8; a row stride of 12 fails in the general function
    std::vector<double> m(12), qa(12), qb(12), buf(3), xa(3), xb(3), rhs{1, -2, 3};
    for (double& e : m) e = int(rng() % 200) - 100;
    for (int stride : {32, 12}) {
        EXPECT_EQ(z.zormQRDecomp_m_64f_3x3(m.data(), stride, buf.data(), qa.data(), stride),
                  z.zormQRDecomp_m_64f(m.data(), stride, 8, buf.data(), qb.data(), stride, 8, 3, 3));
        EXPECT_EQ(z.zormQRBackSubst_mv_64f_3x3(qa.data(), stride, buf.data(), rhs.data(), xa.data()),
                  z.zormQRBackSubst_mv_64f(qb.data(), stride, 8, buf.data(), rhs.data(), 8, xb.data(), 8, 3, 3));
        EXPECT_TRUE(qa == qb && xa == xb);
    }
}

ZT_ALL_VARIANTS(Adapters);

}  // namespace
