// Rotations: the helpers' pinned values (shifts, bound) and the centre form
// (the rotations' mapping and sampling are tested against their definition
// with the warps, test_warp.cpp).
#include <cmath>

#include "tests/support/variants.h"

namespace {

class Rotate : public zt::VariantTest {};

TEST_P(Rotate, HelpersKeepTheCentreAndBoundTheCorners) {
    double x, y, ax = 1, ay = 2, b[2][2] = {};  // cases: centre, angle, shifts (pinned: right angles exact)
    const double cases[][5] = {{3, 7, -90, 10, 4}, {3, 7, 720, 0, 0}, {3, 7, 90, -4, 10}, {3, 7, 180, 6, 14},
                               {0, 0, 45, 0, 0},   {3, 7, 30, NAN},   {3, 7, -200.5, NAN}, {3, 7, 1000.25, NAN}};
    for (const auto& p : cases) {
        ASSERT_EQ(z().zoriGetRotateShift(p[0], p[1], p[2], &x, &y), StatusOk);
        EXPECT_TRUE(std::isnan(p[3]) || (x == p[3] && y == p[4])) << p[2];
        const double r = p[2] * std::atan(1.0) / 45, c = std::cos(r), s = std::sin(r);  // (pi / 180); the centre stays
        EXPECT_NEAR(std::hypot(p[0] * c + p[1] * s + x - p[0], p[1] * c - p[0] * s + y - p[1]), 0, 1e-12);
    }
    EXPECT_TRUE(z().zoriAddRotateShift(1, 1, 180, &ax, &ay) == StatusOk && ax == 3 && ay == 4 &&
                z().zoriGetRotateShift(0, 0, 0, nullptr, &y) == StatusNullPointer &&
                z().zoriAddRotateShift(0, 0, 0, &x, nullptr) == StatusNullPointer);
    // 90 degrees: (x, y) -> (y + 1, -x + 2)
    ASSERT_EQ(z().zoriGetRotateBound({2, 3, 5, 4}, b, 90, 1, 2), StatusOk);
    EXPECT_TRUE(b[0][0] == 4 && b[0][1] == -4 && b[1][0] == 7 && b[1][1] == 0);
    EXPECT_TRUE(z().zoriGetRotateBound({0, 0, 0, 3}, b, 10, 0, 0) == StatusBadSize &&
                z().zoriGetRotateBound({0, 0, 3, 3}, b, NAN, 0, 0) == StatusBadArgument &&
                z().zoriGetRotateBound({0, 0, 3, 3}, nullptr, 0, 0, 0) == StatusNullPointer);
}

TEST_P(Rotate, AboutACentreTakesTheHelpersShifts) {
    std::vector<uint8_t> src(21 * 14 * 3), a(src.size()), b(src.size());
    for (size_t i = 0; i < src.size(); ++i) src[i] = uint8_t(i * 37 % 251);
    const ImageRect roi = {1, 2, 18, 12}, all = {0, 0, 21, 14};
    double xs = 0, ys = 0;
    EXPECT_TRUE(z().zoriGetRotateShift(9, 5.5, 33, &xs, &ys) == StatusOk &&
                z().zoriRotateCenter_8u_C3R(src.data(), {21, 14}, 63, roi, a.data(), 63, all, 33, 9, 5.5, 2) == 0 &&
                z().zoriRotate_8u_C3R(src.data(), {21, 14}, 63, roi, b.data(), 63, all, 33, xs, ys, 2) == 0 && a == b);
}

}  // namespace

ZT_ALL_VARIANTS(Rotate);
