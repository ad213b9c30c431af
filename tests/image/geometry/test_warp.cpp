// Warps against their definition in double: source points solved in the
// test (Cramer's rule, Newton's method), nearest, bilinear and Catmull-Rom
// sampling with neighbours clamped to the source ROI (everything outside it
// poisoned), untouched pixels elsewhere, the accuracy bound of each type;
// the coefficient helpers' values; check order; variant agreement.
#include <algorithm>
#include <cmath>
#include <functional>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

class Warp : public zt::VariantTest {};

// Source point (x, y) of destination (X, Y); false where there is none.
using Inverse = std::function<bool(double X, double Y, double& x, double& y)>;
template <class T>
using Call = std::function<Status(const T*, ImageSize, int, ImageRect, T*, int, ImageRect)>;

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
    if (mode == InterLinear)
        return (1 - fy) * ((1 - fx) * px(i, j) + fx * px(i + 1, j)) + fy * ((1 - fx) * px(i, j + 1) + fx * px(i + 1, j + 1));
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
template <class T, int C>
void expectWarp(const Call<T>& call, const Inverse& inv, ImageSize size, ImageRect srcRoi, ImageRect dstRoi, int mode) {
    std::mt19937 rng(size.width * 31 + srcRoi.x + mode);
    const bool isFloat = std::is_floating_point_v<T>;
    const double top = isFloat ? 1000 : double(std::numeric_limits<T>::max());
    const ImageRect r = {std::max(srcRoi.x, 0), std::max(srcRoi.y, 0),
                         std::min(srcRoi.x + srcRoi.width, size.width) - std::max(srcRoi.x, 0),
                         std::min(srcRoi.y + srcRoi.height, size.height) - std::max(srcRoi.y, 0)};
    std::vector<T> src(size_t(size.width) * size.height * C);
    for (size_t i = 0; i < src.size(); ++i) {
        const int x = int(i / C % size.width), y = int(i / C / size.width);
        const bool in = x >= r.x && x < r.x + r.width && y >= r.y && y < r.y + r.height;
        src[i] = in ? T(std::uniform_real_distribution<double>(isFloat ? -top : 0, top)(rng)) : T(isFloat ? NAN : (x + y) % 2 * top);
    }
    const int dw = dstRoi.x + dstRoi.width + 2, dh = dstRoi.y + dstRoi.height + 2;
    const T sentinel = T(isFloat ? -12345.5 : 77);
    std::vector<T> dst(size_t(dw) * dh * C, sentinel);
    ASSERT_EQ(call(src.data(), size, size.width * C * int(sizeof(T)), srcRoi, dst.data(), dw * C * int(sizeof(T)), dstRoi),
              StatusOk);
    const double e = 1e-7;
    for (int Y = 0; Y < dh; ++Y)
        for (int X = 0; X < dw; ++X) {
            double x = -1e9, y = -1e9;
            const bool inDst = X >= dstRoi.x && X < dstRoi.x + dstRoi.width && Y >= dstRoi.y && Y < dstRoi.y + dstRoi.height;
            const bool hit = inDst && inv(X, Y, x, y);
            const double nx = x + 0.5 - std::floor(x + 0.5), ny = y + 0.5 - std::floor(y + 0.5);
            const bool inside = hit && x >= r.x + e && x <= r.x + r.width - 1 - e && y >= r.y + e && y <= r.y + r.height - 1 - e;
            const bool outside = !hit || x < r.x - e || x > r.x + r.width - 1 + e || y < r.y - e || y > r.y + r.height - 1 + e;
            const bool tie = mode == InterNearest && (std::min(nx, 1 - nx) < 1e-6 || std::min(ny, 1 - ny) < 1e-6);
            for (int k = 0; k < C; ++k) {
                const double got = double(dst[(size_t(Y) * dw + X) * C + k]);
                if (outside) ASSERT_EQ(got, double(sentinel)) << X << "," << Y;
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
                              {{0, 7, 22, 1}, {2, 0, 26, 14}}, {{-4, -3, 20, 30}, {-5, -2, 30, 25}}};
const ImageSize kSize = {26, 19};

// Rotations with scale and shear, exact quarter turn and shift, a mirror.
const double kAffine[][2][3] = {{{0.8, 0.5, 2.3}, {-0.45, 0.9, 9.7}},
                                {{0, 1, -1}, {-1, 0, 24}},
                                {{-1.7, 0.2, 35.5}, {0.1, 1.9, -3.2}},
                                {{0.31, -0.05, 4}, {0.07, 0.42, 2}}};

template <class T, int C, class F>
void expectAffine(F f) {
    for (const auto& c : kAffine)
        for (const auto& rois : kRois)
            for (int mode : {InterNearest, InterLinear, InterCubic})
                expectWarp<T, C>([&](auto... a) { return f(a..., c, mode); }, affineInverse(c), kSize, rois[0], rois[1], mode);
}

TEST_P(Warp, AffineFollowsTheDefinition) {
    expectAffine<uint8_t, 1>(z().zoriWarpAffine_8u_C1R);
    expectAffine<uint8_t, 3>(z().zoriWarpAffine_8u_C3R);
    expectAffine<uint8_t, 4>(z().zoriWarpAffine_8u_C4R);
    expectAffine<float, 1>(z().zoriWarpAffine_32f_C1R);
    expectAffine<float, 3>(z().zoriWarpAffine_32f_C3R);
    // the 16-bit forms of the engine, reached through the rotations
    for (double angle : {0.0, 90.0, 33.0, -151.0}) {
        const double t = angle * M_PI / 180, c[2][3] = {{std::cos(t), std::sin(t), 17.25}, {-std::sin(t), std::cos(t), 3.5}};
        for (const auto& rois : kRois)
            for (int mode : {InterNearest, InterLinear, InterCubic}) {
                expectWarp<uint16_t, 1>([&](auto... a) { return z().zoriRotate_16u_C1R(a..., angle, 17.25, 3.5, mode); },
                                        affineInverse(c), kSize, rois[0], rois[1], mode);
                expectWarp<uint16_t, 3>([&](auto... a) { return z().zoriRotate_16u_C3R(a..., angle, 17.25, 3.5, mode); },
                                        affineInverse(c), kSize, rois[0], rois[1], mode);
            }
    }
}

}  // namespace

ZT_ALL_VARIANTS(Warp);
