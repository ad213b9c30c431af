// Warps against their definition in double: source points solved in the
// test (Cramer's rule, Newton's method), nearest, bilinear and Catmull-Rom
// sampling with neighbours clamped to the source ROI (everything outside it
// poisoned), untouched pixels elsewhere, the accuracy bound of each type;
// the coefficient helpers' values; check order; variant agreement.
#include <algorithm>
#include <cmath>
#include <functional>
#include <random>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class Warp : public zt::VariantTest {};

// Source point (x, y) of destination (X, Y); false where there is none.
using Inverse = std::function<bool(double X, double Y, double& x, double& y)>;

Inverse affineInverse(const double c[2][3]) {
    return [=](double X, double Y, double& x, double& y) {
        const double det = c[0][0] * c[1][1] - c[0][1] * c[1][0], p = X - c[0][2], q = Y - c[1][2];
        x = (p * c[1][1] - c[0][1] * q) / det, y = (c[0][0] * q - c[1][0] * p) / det;
        return true;
    };
}
// (c00 - X c20) x + (c01 - X c21) y = X c22 - c02, likewise for Y.
Inverse perspectiveInverse(const double c[3][3]) {
    return [=](double X, double Y, double& x, double& y) {
        const double a = c[0][0] - X * c[2][0], b = c[0][1] - X * c[2][1], p = X * c[2][2] - c[0][2];
        const double d = c[1][0] - Y * c[2][0], e = c[1][1] - Y * c[2][1], q = Y * c[2][2] - c[1][2];
        x = (p * e - b * q) / (a * e - b * d), y = (a * q - p * d) / (a * e - b * d);
        return std::isfinite(x) && std::isfinite(y);
    };
}
Inverse bilinearInverse(const double c[2][4], double x0, double y0) {
    return [=](double X, double Y, double& x, double& y) {
        x = x0, y = y0;
        for (int it = 0; it < 60; ++it) {
            const double fx = c[0][0] * x * y + c[0][1] * x + c[0][2] * y + c[0][3] - X;
            const double fy = c[1][0] * x * y + c[1][1] * x + c[1][2] * y + c[1][3] - Y;
            const double a = c[0][0] * y + c[0][1], b = c[0][0] * x + c[0][2], d = c[1][0] * y + c[1][1],
                         e = c[1][0] * x + c[1][2];
            x -= (fx * e - b * fy) / (a * e - b * d), y -= (a * fy - fx * d) / (a * e - b * d);
        }
        return std::hypot(c[0][0] * x * y + c[0][1] * x + c[0][2] * y + c[0][3] - X,
                          c[1][0] * x * y + c[1][1] * x + c[1][2] * y + c[1][3] - Y) < 1e-9;
    };
}

// The definition at source point (x, y) of a w-wide image of c channels,
// neighbours clamped to the ROI r.
template <class T>
double sampleAt(const std::vector<T>& img, int w, int c, ImageRect r, double x, double y, int k, int mode) {
    auto px = [&](double i, double j) {
        const int ci = int(std::clamp(i, double(r.x), double(r.x + r.width - 1)));
        return double(img[(size_t(std::clamp(j, double(r.y), double(r.y + r.height - 1))) * w + ci) * c + k]);
    };
    if (mode == InterNearest) return px(std::floor(x + 0.5), std::floor(y + 0.5));
    const double i = std::floor(x), j = std::floor(y), fx = x - i, fy = y - j;
    auto row = [&](double j) { return (1 - fx) * px(i, j) + fx * px(i + 1, j); };
    if (mode == InterLinear) return (1 - fy) * row(j) + fy * row(j + 1);
    auto cr = [](double t, int n) {  // Catmull-Rom weight of neighbour n = -1 .. 2
        const double d = std::fabs(t - n);
        return d < 1 ? 1.5 * d * d * d - 2.5 * d * d + 1 : d < 2 ? -0.5 * d * d * d + 2.5 * d * d - 4 * d + 2 : 0;
    };
    double v = 0;
    for (int n = -1; n <= 2; ++n)
        for (int m = -1; m <= 2; ++m) v += cr(fx, m) * cr(fy, n) * px(i + m, j + n);
    return v;
}

// Runs call on a random image (poison outside srcRoi) into a destination
// filled with a sentinel: pixels whose source point is clearly inside the
// clipped srcRoi must match the definition, those clearly outside (or
// outside dstRoi) keep the sentinel.
template <class T, int C, class F>
void expectWarp(F call, const Inverse& inv, ImageRect srcRoi, ImageRect dstRoi, int mode) {
    const ImageSize size = {26, 19};
    std::mt19937 rng(srcRoi.x * 31 + mode);
    const bool isFloat = std::is_floating_point_v<T>;
    const double top = isFloat ? 1000 : double(std::numeric_limits<T>::max());
    const ImageRect r = {std::max(srcRoi.x, 0), std::max(srcRoi.y, 0),
                         std::min(srcRoi.x + srcRoi.width, size.width) - std::max(srcRoi.x, 0),
                         std::min(srcRoi.y + srcRoi.height, size.height) - std::max(srcRoi.y, 0)};
    std::vector<T> src(size_t(size.width) * size.height * C);
    for (size_t i = 0; i < src.size(); ++i) {
        const int x = int(i / C % size.width), y = int(i / C / size.width);
        const bool in = x >= r.x && x < r.x + r.width && y >= r.y && y < r.y + r.height;
        const double poison = isFloat ? NAN : (x + y) % 2 * top;
        src[i] = T(in ? std::uniform_real_distribution<double>(isFloat ? -top : 0, top)(rng) : poison);
    }
    const int dw = dstRoi.x + dstRoi.width + 2, dh = dstRoi.y + dstRoi.height + 2, row = C * int(sizeof(T));
    const T sentinel = T(isFloat ? -12345.5 : 77);
    std::vector<T> dst(size_t(dw) * dh * C, sentinel);
    ASSERT_EQ(call(src.data(), size, size.width * row, srcRoi, dst.data(), dw * row, dstRoi, mode), StatusOk);
    for (int Y = 0; Y < dh; ++Y)
        for (int X = 0; X < dw; ++X) {
            double x = -1e9, y = -1e9;
            const bool hit = X >= dstRoi.x && X < dstRoi.x + dstRoi.width && Y >= dstRoi.y &&
                             Y < dstRoi.y + dstRoi.height && inv(X, Y, x, y);
            auto within = [&](double m) {  // the point at least m inside the ROI (m < 0: at most -m outside)
                return x >= r.x + m && x <= r.x + r.width - 1 - m && y >= r.y + m && y <= r.y + r.height - 1 - m;
            };
            const double nx = x + 0.5 - std::floor(x + 0.5), ny = y + 0.5 - std::floor(y + 0.5);
            const double margin = x == std::floor(x) && y == std::floor(y) ? 0 : 1e-7;  // exact maps: the edge is in
            const bool inside = hit && within(margin), outside = !hit || !within(-margin);
            const bool tie = mode == InterNearest && std::min({nx, 1 - nx, ny, 1 - ny}) < 1e-6;
            for (int k = 0; k < C; ++k) {
                const double got = double(dst[(size_t(Y) * dw + X) * C + k]);
                ASSERT_TRUE(!outside || got == double(sentinel)) << X << "," << Y << " written";
                if (!inside || tie) continue;
                const double want = sampleAt(src, size.width, C, r, x, y, k, mode);
                const double tol = mode == InterNearest ? 0 : isFloat ? 1e-5 * top : 1;
                ASSERT_LE(std::fabs(got - (isFloat ? want : std::clamp(want, 0.0, top))), tol)
                    << X << "," << Y << " k" << k << " mode " << mode << " at " << x << "," << y;
            }
        }
}

// Source/destination ROIs: offset in a larger image, a single column, a
// single row, partly outside both images.
const ImageRect kRois[][2] = {{{3, 2, 20, 15}, {1, 2, 30, 22}}, {{5, 1, 1, 14}, {0, 0, 12, 20}},
                              {{0, 7, 22, 1}, {2, 0, 26, 14}}, {{-4, -3, 40, 30}, {-5, -2, 30, 25}}};

// Rotations with scale and shear, exact quarter turn and mirror, a mirror.
const double kAffine[][2][3] = {{{0.8, 0.5, 2.3}, {-0.45, 0.9, 9.7}}, {{0, 1, -1}, {-1, 0, 24}},
                                {{-1, 0, 25}, {0, 1, -2}}, {{-1.7, 0.2, 35.5}, {0.1, 1.9, -3.2}},
                                {{0.31, -0.05, 4}, {0.07, 0.42, 2}}};

// f(images..., x..., mode): a warp with its coefficients (or angle and
// shifts) bound.
template <class F, class... X>
auto bind(F f, X... x) {
    return [=](auto s, ImageSize r, int ss, ImageRect sr, auto d, int ds, ImageRect dr, int mode) {
        return f(s, r, ss, sr, d, ds, dr, x..., mode);
    };
}

// The first n pairs of ROIs, every interpolation.
template <class T, int C, class F>
void expectAll(F f, const Inverse& inv, int n = 4) {
    for (int i = 0; i < n; ++i)
        for (int mode : {InterNearest, InterLinear, InterCubic})
            expectWarp<T, C>(f, inv, kRois[i][0], kRois[i][1], mode);
}

TEST_P(Warp, AffineFollowsTheDefinition) {
    for (const auto& c : kAffine) {
        expectAll<uint8_t, 1>(bind(z().zoriWarpAffine_8u_C1R, c), affineInverse(c));
        expectAll<uint8_t, 3>(bind(z().zoriWarpAffine_8u_C3R, c), affineInverse(c));
        expectAll<uint8_t, 4>(bind(z().zoriWarpAffine_8u_C4R, c), affineInverse(c));
        expectAll<float, 1>(bind(z().zoriWarpAffine_32f_C1R, c), affineInverse(c));
        expectAll<float, 3>(bind(z().zoriWarpAffine_32f_C3R, c), affineInverse(c));
    }
    for (double angle : {0.0, 90.0, 33.0, -151.0}) {  // (x, y) -> (x c + y s + 17.25, -x s + y c + 3.5)
        const double t = angle * std::atan(1.0) / 45, c = std::cos(t), s = std::sin(t);  // (pi / 180)
        const double m[2][3] = {{c, s, 17.25}, {-s, c, 3.5}};
        expectAll<uint16_t, 1>(bind(z().zoriRotate_16u_C1R, angle, 17.25, 3.5), affineInverse(m));
        expectAll<uint16_t, 3>(bind(z().zoriRotate_16u_C3R, angle, 17.25, 3.5), affineInverse(m));
        expectAll<uint8_t, 1>(bind(z().zoriRotate_8u_C1R, angle, 17.25, 3.5), affineInverse(m));
        expectAll<uint8_t, 3>(bind(z().zoriRotate_8u_C3R, angle, 17.25, 3.5), affineInverse(m));
        expectAll<float, 3>(bind(z().zoriRotate_32f_C3R, angle, 17.25, 3.5), affineInverse(m));
    }
}

// The ROI (3, 2, 20, 15) to a quad in the destination images, and one that
// narrows fast to the right (one-to-one as a bilinear map on that ROI only).
const double kQuad[4][2] = {{1.5, 3.2}, {27.9, 1.1}, {24.3, 19.8}, {4.2, 16.7}};
const double kTapered[4][2] = {{1, 1}, {28, 9}, {28, 11}, {1, 19}};

TEST_P(Warp, PerspectiveAndBilinearFollowTheDefinition) {
    double p[3][3], b[2][4];
    for (const double(*quad)[2] : {kQuad, kTapered}) {
        ASSERT_TRUE(z().zoriGetPerspectiveTransform(kRois[0][0], quad, p) == 0 &&
                    z().zoriGetBilinearTransform(kRois[0][0], quad, b) == 0);
        const int n = quad == kTapered ? 1 : 4;
        expectAll<uint8_t, 1>(bind(z().zoriWarpPerspective_8u_C1R, p), perspectiveInverse(p), n);
        expectAll<uint8_t, 3>(bind(z().zoriWarpPerspective_8u_C3R, p), perspectiveInverse(p), n);
        expectAll<uint8_t, 1>(bind(z().zoriWarpBilinear_8u_C1R, b), bilinearInverse(b, 13, 9), n);
        expectAll<uint8_t, 3>(bind(z().zoriWarpBilinear_8u_C3R, b), bilinearInverse(b, 13, 9), n);
    }
}

TEST_P(Warp, HelpersMapTheCornersToTheQuad) {
    const ImageRect roi = {2, 3, 5, 4};  // corners (2, 3), (6, 3), (6, 6), (2, 6)
    double bound[2][2], a[2][3], b[2][4], p[3][3], q[4][2];
    const double turn[2][3] = {{0, 1, 10}, {-1, 0, 20}}, flat[2][3] = {{1, 2, 0}, {2, 4, 0}};
    ASSERT_EQ(z().zoriGetAffineBound(roi, bound, turn), StatusOk);
    EXPECT_TRUE(bound[0][0] == 13 && bound[0][1] == 14 && bound[1][0] == 16 && bound[1][1] == 18);
    EXPECT_EQ(z().zoriGetAffineBound(roi, bound, flat), StatusBadArgument);
    // an affine map's image of the corners gives the map back
    const double m[2][3] = {{0.5, -2, 7}, {1.25, 0.75, -3}}, cx[4] = {2, 6, 6, 2}, cy[4] = {3, 3, 6, 6};
    for (int i = 0; i < 4; ++i)
        for (int r = 0; r < 2; ++r) q[i][r] = m[r][0] * cx[i] + m[r][1] * cy[i] + m[r][2];
    ASSERT_EQ(z().zoriGetAffineTransform(roi, q, a), StatusOk);
    for (int r = 0; r < 2; ++r)
        for (int k = 0; k < 3; ++k) EXPECT_NEAR(a[r][k], m[r][k], 1e-12);
    q[3][0] += 0.9e-9 * 8;  // the fourth point off by 0.9e-9 of the extent (8: x from -4 to 4), then 1.1e-9
    EXPECT_EQ(z().zoriGetAffineTransform(roi, q, a), StatusOk);
    q[3][0] += 0.2e-9 * 8;
    EXPECT_EQ(z().zoriGetAffineTransform(roi, q, a), StatusBadArgument);
    // bilinear and perspective hit all four corners
    ASSERT_TRUE(!z().zoriGetBilinearTransform(roi, kQuad, b) && !z().zoriGetPerspectiveTransform(roi, kQuad, p));
    EXPECT_NEAR(p[2][0] * 2 + p[2][1] * 3 + p[2][2], 1, 1e-14);
    for (int i = 0; i < 4; ++i) {
        const double w = p[2][0] * cx[i] + p[2][1] * cy[i] + p[2][2];
        for (int r = 0; r < 2; ++r) {
            EXPECT_NEAR(b[r][0] * cx[i] * cy[i] + b[r][1] * cx[i] + b[r][2] * cy[i] + b[r][3], kQuad[i][r], 1e-9);
            EXPECT_NEAR((p[r][0] * cx[i] + p[r][1] * cy[i] + p[r][2]) / w, kQuad[i][r], 1e-9);
        }
    }
    // quads that no ROI maps to: crossed, three points on a line, not finite
    const double crossed[4][2] = {{0, 0}, {9, 0}, {0, 9}, {9, 9}}, line[4][2] = {{0, 0}, {4, 0}, {8, 0}, {0, 9}},
                 nan[4][2] = {{0, 0}, {9, 0}, {9, NAN}, {0, 9}}, square[4][2] = {{0, 0}, {9, 0}, {9, 9}, {0, 9}};
    for (auto bad : {crossed, line, nan})
        EXPECT_TRUE(z().zoriGetAffineTransform(roi, bad, a) == StatusBadArgument &&
                    z().zoriGetBilinearTransform(roi, bad, b) == StatusBadArgument &&
                    z().zoriGetPerspectiveTransform(roi, bad, p) == StatusBadArgument);
    EXPECT_EQ(z().zoriGetPerspectiveTransform({0, 0, 1, 5}, square, p), StatusBadArgument);
    EXPECT_EQ(z().zoriGetBilinearTransform({0, 0, 5, 0}, square, b), StatusBadSize);
    EXPECT_EQ(z().zoriGetAffineTransform({0, 0, 0, 0}, nullptr, a), StatusNullPointer);
}

TEST_P(Warp, ChecksInOrder) {
    uint8_t src[64] = {}, dst[64] = {};
    const double ok[2][3] = {{1, 0, 0}, {0, 1, 0}}, flat[2][3] = {{1, 2, 0}, {2, 4, 0}},
                 nan[2][3] = {{NAN, 0, 0}, {0, 1, 0}};
    const ImageRect all = {0, 0, 8, 8}, away = {8, 0, 4, 4};
    zt::expectChecks(z().zoriWarpAffine_8u_C1R, {src, {8, 8}, 8, all, dst, 8, all, ok, InterLinear},
                     {zt::watch(dst, 64)}, zt::eachNull(), zt::bad(StatusBadSize, zt::arg<1>(ImageSize{0, 8})),
                     zt::bad(StatusBadSize, zt::arg<3>(ImageRect{0, 0, 8, 0})),
                     zt::bad(StatusBadSize, zt::arg<6>(ImageRect{0, 0, -1, 8})), zt::bad(StatusBadStep, zt::arg<2>(0)),
                     zt::bad(StatusBadStep, zt::arg<5>(-8)), zt::bad(StatusBadInterpolation, zt::arg<8>(3)),
                     zt::bad(StatusBadInterpolation, zt::arg<8>(InterSuper)),
                     zt::bad(StatusBadArgument, zt::arg<7>(flat)), zt::bad(StatusBadArgument, zt::arg<7>(nan)),
                     zt::bad(StatusWarnNoOperation, zt::arg<3>(away)),
                     zt::bad(StatusWarnNoOperation, zt::arg<6>(ImageRect{-4, 2, 4, 4})),
                     zt::bad(StatusNullPointer, zt::arg<7>(nullptr), zt::arg<1>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<6>(ImageRect{0, 0, 0, 0}), zt::arg<2>(0)),
                     zt::bad(StatusBadStep, zt::arg<5>(0), zt::arg<8>(3)),
                     zt::bad(StatusBadInterpolation, zt::arg<8>(3), zt::arg<7>(flat)),
                     zt::bad(StatusBadArgument, zt::arg<7>(flat), zt::arg<3>(away)));
    // folded bilinear map (x' = x y: its Jacobian vanishes on row 0), singular perspective
    const double folded[2][4] = {{1, 0, 0, 0}, {0, 0, 1, 0}}, flat3[3][3] = {{1, 2, 3}, {2, 4, 6}, {0, 0, 1}};
    EXPECT_EQ(z().zoriWarpBilinear_8u_C1R(src, {8, 8}, 8, all, dst, 8, all, folded, 2), StatusBadArgument);
    EXPECT_EQ(z().zoriWarpPerspective_8u_C3R(src, {2, 8}, 8, all, dst, 8, all, flat3, 2), StatusBadArgument);
}

// Random images, the source ROI a corner of the image, every interpolation:
// the statuses as text.
template <class T, int C, class F>
std::string warpCase(zt::Case& c, F f) {
    const ImageSize r = c.roi();
    const auto s = c.inImage<T>(r.width * C, r.height);
    const auto d = c.outImage<T>(r.width * C, r.height);
    const ImageRect all = {0, 0, r.width, r.height}, part = {r.width / 4, r.height / 3, r.width, r.height};
    std::string status;
    for (int mode : {InterNearest, InterLinear, InterCubic})
        status += std::to_string(f(s.p, r, s.step, part, d.p, d.step, all, mode)) + " ";
    return status;
}

TEST_P(Warp, VariantsAgree) {
    zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
        // turns with scale about the centre, and bilinear and perspective maps near them
        const double t = c.index() * 0.7, k = 0.6 + 0.1 * (c.index() % 7), w = c.roi().width, h = c.roi().height;
        const double co = k * std::cos(t), si = k * std::sin(t);
        const double xs = (w - co * w - si * h) / 2, ys = (h - co * h + si * w) / 2;
        const double a[2][3] = {{co, si, xs}, {-si, co, ys}};
        const double b[2][4] = {{0.002, a[0][0], a[0][1], xs}, {-0.001, a[1][0], a[1][1], ys}};
        const double p[3][3] = {{a[0][0], a[0][1], xs}, {a[1][0], a[1][1], ys}, {0.001, -0.002, 1}};
        const double deg = t * 45 / std::atan(1.0), (*ac)[3] = a, (*bc)[4] = b, (*pc)[3] = p;
        return warpCase<uint8_t, 1>(c, bind(z.zoriWarpAffine_8u_C1R, ac)) +
               warpCase<uint8_t, 3>(c, bind(z.zoriWarpAffine_8u_C3R, ac)) +
               warpCase<uint8_t, 4>(c, bind(z.zoriWarpAffine_8u_C4R, ac)) +
               warpCase<float, 1>(c, bind(z.zoriWarpAffine_32f_C1R, ac)) +
               warpCase<float, 3>(c, bind(z.zoriWarpAffine_32f_C3R, ac)) +
               warpCase<uint8_t, 1>(c, bind(z.zoriRotate_8u_C1R, deg, xs, ys)) +
               warpCase<uint16_t, 1>(c, bind(z.zoriRotate_16u_C1R, deg, xs, ys)) +
               warpCase<uint16_t, 3>(c, bind(z.zoriRotate_16u_C3R, deg, xs, ys)) +
               warpCase<float, 3>(c, bind(z.zoriRotate_32f_C3R, deg, xs, ys)) +
               warpCase<uint8_t, 3>(c, bind(z.zoriRotateCenter_8u_C3R, deg, w / 3, h / 2)) +
               warpCase<uint8_t, 1>(c, bind(z.zoriWarpBilinear_8u_C1R, bc)) +
               warpCase<uint8_t, 3>(c, bind(z.zoriWarpBilinear_8u_C3R, bc)) +
               warpCase<uint8_t, 1>(c, bind(z.zoriWarpPerspective_8u_C1R, pc)) +
               warpCase<uint8_t, 3>(c, bind(z.zoriWarpPerspective_8u_C3R, pc));
    });
}

// 8-bit linear over many pixels: a slip in the register arithmetic's
// rounding shows once in thousands.
TEST_P(Warp, LinearEightBitMatchesGenericOnALargeImage) {
    const ImageSize size = {301, 203};
    const ImageRect roi = {0, 0, size.width, size.height};
    const double c[2][3] = {{0.83, 0.61, -40.2}, {-0.57, 0.79, 120.4}};
    std::vector<uint8_t> src(size_t(size.width) * size.height * 4), mine(src.size()), generic(src.size());
    std::mt19937 rng(3);
    for (auto& v : src) v = uint8_t(rng());
    auto run = [&](const zt::Api& a, int ch, std::vector<uint8_t>& d) {
        auto f = ch == 1 ? a.zoriWarpAffine_8u_C1R : ch == 3 ? a.zoriWarpAffine_8u_C3R : a.zoriWarpAffine_8u_C4R;
        return f(src.data(), size, size.width * ch, roi, d.data(), size.width * ch, roi, c, InterLinear);
    };
    for (int ch : {1, 3, 4}) {
        ASSERT_TRUE(run(z(), ch, mine) == StatusOk && run(zt::api(0), ch, generic) == StatusOk);
        EXPECT_TRUE(mine == generic) << ch << " channels";
    }
}

}  // namespace

ZT_ALL_VARIANTS(Warp);
