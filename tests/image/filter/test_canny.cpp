// Canny: buffer size, magnitudes and thresholds, direction classes and their
// tie rules, hysteresis, clearing of whole rows, check order.
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Canny : public zt::VariantTest {};

struct Grad {
    int w, h;
    std::vector<int16_t> dx, dy;
    Grad(int w, int h) : w(w), h(h), dx(size_t(w) * h), dy(size_t(w) * h) {}
    void set(int x, int y, int gx, int gy) { dx[size_t(y) * w + x] = int16_t(gx), dy[size_t(y) * w + x] = int16_t(gy); }
};

// Straightforward detector: magnitudes, suppression, then growth by a
// breadth-first search (the result does not depend on the visiting order).
std::vector<uint8_t> reference(const Grad& g, float low, float high) {
    const int w = g.w, h = g.h;
    const auto at = [w](int x, int y) { return size_t(y) * w + x; };
    const auto mag = [&](int x, int y) {
        if (x < 0 || y < 0 || x >= w || y >= h) return 0;
        const int m = std::abs(int(g.dx[at(x, y)])) + std::abs(int(g.dy[at(x, y)]));
        return m > int(low) ? m : 0;
    };
    std::vector<uint8_t> cand(size_t(w) * h), out(size_t(w) * h);
    std::vector<int> todo;
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            const int m = mag(x, y), gx = g.dx[at(x, y)], gy = g.dy[at(x, y)];
            const double ax = std::abs(gx), ay = std::abs(gy);
            const int up = (gx < 0) != (gy < 0) ? 1 : -1;  // the diagonal neighbour above
            const bool keep = m > 0 && (ay < 0.41421356237309503 * ax ? m > mag(x - 1, y) && m >= mag(x + 1, y)
                                        : ay <= 2.414213562373095 * ax ? m > mag(x + up, y - 1) && m > mag(x - up, y + 1)
                                                                       : m > mag(x, y - 1) && m >= mag(x, y + 1));
            cand[at(x, y)] = keep;
            if (keep && float(m) > high) out[at(x, y)] = 255, todo.push_back(int(at(x, y)));
        }
    for (size_t i = 0; i < todo.size(); ++i)
        for (int k = 0; k < 9; ++k) {
            const int x = todo[i] % w + k % 3 - 1, y = todo[i] / w + k / 3 - 1;
            if (x >= 0 && y >= 0 && x < w && y < h && cand[at(x, y)] && !out[at(x, y)])
                out[at(x, y)] = 255, todo.push_back(int(at(x, y)));
        }
    return out;
}

// Runs the detector with guarded inputs, a buffer of exactly the reported
// size, and a destination whose rows are wider than the ROI.
std::vector<uint8_t> run(const zt::Api& z, const Grad& g, float low, float high, int extra = 3) {
    const int w = g.w, h = g.h, step = w + extra;
    zt::GuardedImage<int16_t> dx(w, h, 0, 2), dy(w, h, 0, 0, zt::Guard::Before);
    dx.fill([&](int x, int y) { return g.dx[size_t(y) * w + x]; });
    dy.fill([&](int x, int y) { return g.dy[size_t(y) * w + x]; });
    int size = 0;
    EXPECT_EQ(zt::api(0).zoriCannyGetSize({w, h}, &size), StatusOk);
    // the destination: exactly height * step bytes, the last row's padding is cleared too
    zt::GuardedBuffer buf(size_t(size), w % 2 ? zt::Guard::After : zt::Guard::Before), dst(size_t(h) * size_t(step));
    std::memset(buf.data(), 0xCD, buf.size());
    std::memset(dst.data(), 0x5A, dst.size());
    EXPECT_EQ(z.zoriCanny_16s8u_C1R(dx.roi(), dx.step(), dy.roi(), dy.step(), dst.data(), step, {w, h}, low, high,
                                    buf.data()), StatusOk);
    std::vector<uint8_t> out(size_t(w) * h);
    for (int y = 0; y < h; ++y) {
        std::memcpy(&out[size_t(y) * w], dst.data() + size_t(y) * step, size_t(w));
        for (int x = w; x < step; ++x) EXPECT_EQ(dst.data()[size_t(y) * step + x], 0) << x << "," << y;
    }
    return out;
}

// Random derivatives over small ranges (many ties), wide ranges, and the
// extremes (magnitudes up to 65536 beside 65535), against thresholds at the
// edges: low 0, low and high near and above 65535.
TEST_P(Canny, RandomGradientsMatchReference) {
    std::mt19937 rng(41 + variant());
    static const int16_t extremes[] = {-32768, -32767, 32767, 32766, 0, 1, -1, -16384};
    static const float extremeLows[] = {0.0f, 1.0f, 65534.0f, 65535.0f, 65536.0f, 40000.0f};
    for (int trial = 0; trial < 18; ++trial) {
        const bool extreme = trial >= 12;
        const int w = 1 + int(rng() % 45), h = 1 + int(rng() % 20), range = trial % 3 == 0 ? 3 : trial % 3 == 1 ? 60 : 32768;
        const auto value = [&] { return int16_t(extreme ? extremes[rng() % 8] : int(rng() % (2 * range)) - range); };
        Grad g(w, h);
        for (size_t i = 0; i < g.dx.size(); ++i) g.dx[i] = value(), g.dy[i] = value();
        const float low = extreme ? extremeLows[trial - 12] : trial % 3 == 2 ? 3000.0f : float(rng() % 20) + 0.7f;
        for (float high : {low * 2.5f, low, low + 0.5f, 65535.0f, 65535.5f, 65536.0f, 1e30f}) {
            high = std::max(high, low);
            ASSERT_EQ(run(z(), g, low, high), reference(g, low, high)) << trial << " " << low << " " << high;
        }
    }
}

// Smooth random pictures give long, connected edges: growth runs across many
// rows, also upwards, and through rows far above the one being suppressed.
// Every other picture has the one magnitude of 65536 in its last row: the
// vector variants give up there and everything is redone another way, with
// the same result.
TEST_P(Canny, TallPicturesMatchReference) {
    std::mt19937 rng(7 + variant());
    for (int trial = 0; trial < 6; ++trial) {
        const int w = 8 + int(rng() % 60), h = 30 + int(rng() % 70);
        std::uniform_real_distribution<double> u(0.02, 0.3);
        const double fx = u(rng), fy = u(rng), fz = u(rng), px = 20 * u(rng), py = 20 * u(rng);
        const auto f = [&](int x, int y) {  // waves under a slow envelope
            return 150 * std::sin(x * fx + px) * std::sin(y * fy + py) * std::sin((x + 2 * y) * fz / 8 + px);
        };
        Grad g(w, h);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) {
                const int nx = int(rng() % 5) - 2, ny = int(rng() % 5) - 2;  // a little noise
                g.set(x, y, int(8 * (f(x + 1, y) - f(x - 1, y))) + nx, int(8 * (f(x, y + 1) - f(x, y - 1))) + ny);
            }
        if (trial % 2) g.set(int(rng() % w), h - 1, -32768, -32768);
        for (const float low : {0.0f, 1.0f, 20.0f, 60.5f}) {
            const float high = std::max(low, 1.0f) * (trial % 3 ? 2.0f : 6.0f);
            ASSERT_EQ(run(z(), g, low, high), reference(g, low, high)) << trial << " " << low;
        }
    }
}

// Gradients on both sides of the direction class borders, ay < tan 22.5 ax
// and ay > tan 67.5 ax as the double products decide them, each beside a
// larger neighbour that suppresses it only in the class on one side.
TEST_P(Canny, DirectionClassBorders) {
    std::mt19937 rng(5 + variant());
    const double t22 = 0.41421356237309503, t67 = 2.414213562373095;
    // the largest ay with ay < t * ax, and the smallest with ay > t * ax
    auto below22 = [&](int ax) { int ay = int(t22 * ax) + 1; while (!(double(ay) < t22 * ax)) --ay; return ay; };
    auto above67 = [&](int ax) { int ay = int(t67 * ax) - 1; while (!(double(ay) > t67 * ax)) ++ay; return ay; };
    for (int image = 0; image < 4; ++image) {
        const int cols = 41, rows = 20;
        Grad g(3 * cols, 3 * rows);
        for (int k = 0; k < cols * rows; ++k) {
            const int x = 3 * (k % cols), y = 3 * (k / cols), vertical = k % 2;
            // the first ones at the ends of the ranges
            const int ax = k < 16 ? (vertical ? 1 + k / 2 : 32768 - k / 2) : 1 + int(rng() % (vertical ? 13500 : 32768));
            const int ay = vertical ? above67(ax) - int(k / 2 % 2) : below22(ax) + int(k / 2 % 2);
            const int sx = rng() % 2 ? 1 : -1, sy = rng() % 2 ? 1 : -1;
            g.set(x, y, ax == 32768 ? -32768 : sx * ax, sy * ay);
            g.set(x + 1 - vertical, y + vertical, 32767, 32767);
        }
        ASSERT_EQ(run(z(), g, 1, 2), reference(g, 1, 2)) << image;
    }
}

// Pointers, size, steps (the derivatives' at least a row and even), then
// thresholds (0 <= low <= high, no NaN); on failure nothing is written.
TEST_P(Canny, ChecksAndSizes) {
    const auto& z = this->z();
    const struct { ImageSize roi; int size; } sizes[] = {
        {{3, 2}, 5 * 5 * 4 + 16 * 3 + 160}, {{65532, 1}, 5 * 65534 * 3 + 16 * 65532 + 160},
        {{65533, 1}, 9 * 65535 * 3 + 16 * 65533 + 160}, {{1, 65533}, 9 * 65535 * 3 + 16 + 160}};
    int n = 0;
    for (const auto& c : sizes)
        EXPECT_TRUE(z.zoriCannyGetSize(c.roi, &n) == StatusOk && n == c.size) << c.roi.width << "x" << c.roi.height << ": " << n;
    zt::expectChecks(z.zoriCannyGetSize, {ImageSize{3, 2}, &n}, {zt::watch(&n, sizeof n)}, zt::eachNull(), zt::badRoi<0>(),
                     zt::bad(StatusNullPointer, zt::arg<0>(ImageSize{0, 1}), zt::arg<1>(nullptr)));
    int16_t dx[64] = {}, dy[64] = {};
    uint8_t d[64], buf[2048];
    std::memset(d, 7, sizeof d);
    zt::expectChecks(z.zoriCanny_16s8u_C1R, {dx, 8, dy, 8, d, 4, ImageSize{4, 2}, 5.0f, 5.0f, buf}, {zt::watch(d, sizeof d)},
                     zt::eachNull(), zt::badRoi<6>(), zt::bad(StatusBadStep, zt::arg<1>(7)), zt::bad(StatusBadStep, zt::arg<3>(7)),
                     zt::bad(StatusBadStep, zt::arg<5>(3)), zt::bad(StatusNotEvenStep, zt::arg<1>(9)),
                     zt::bad(StatusNotEvenStep, zt::arg<3>(11)), zt::bad(StatusBadArgument, zt::arg<7>(-1.0f)),
                     zt::bad(StatusBadArgument, zt::arg<7>(6.0f)), zt::bad(StatusBadArgument, zt::arg<7>(NAN)),
                     zt::bad(StatusBadArgument, zt::arg<8>(NAN)),
                     zt::bad(StatusNullPointer, zt::arg<9>(nullptr), zt::arg<6>(ImageSize{0, 0})),
                     zt::bad(StatusBadSize, zt::arg<6>(ImageSize{0, 2}), zt::arg<7>(-1.0f)),
                     zt::bad(StatusBadStep, zt::arg<1>(7), zt::arg<3>(0), zt::arg<5>(0), zt::arg<7>(-1.0f)),
                     zt::bad(StatusNotEvenStep, zt::arg<1>(9), zt::arg<7>(-1.0f)));
    for (int i = 0; i < 64; ++i) EXPECT_EQ(d[i], i < 8 ? 0 : 7);
}

TEST_P(Canny, WideCoordinates) {
    // a padded width of 65535 switches the stack to 32-bit coordinates
    Grad g(65533, 1);
    for (int x = 0; x < g.w; x += 7) g.set(x, 0, x % 3 ? 40 : 200, 0);
    g.set(65532, 0, 200, 0), g.set(65531, 0, 20, 20);
    const auto e = run(z(), g, 10, 100, 0);
    EXPECT_TRUE(e == reference(g, 10, 100) && e[65532] == 255);
}

}  // namespace

ZT_ALL_VARIANTS(Canny);
