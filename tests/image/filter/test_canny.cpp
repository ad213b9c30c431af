// Canny: buffer size, magnitudes and thresholds, direction classes and their
// tie rules, hysteresis, clearing of whole rows, check order.
#include <cmath>
#include <cstdint>
#include <cstring>
#include <limits>
#include <random>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class Canny : public zt::VariantTest {};

struct Grad {
    int w, h;
    std::vector<int16_t> dx, dy;
    Grad(int w, int h) : w(w), h(h), dx(size_t(w) * h), dy(size_t(w) * h) {}
    void set(int x, int y, int gx, int gy) {
        dx[size_t(y) * w + x] = int16_t(gx);
        dy[size_t(y) * w + x] = int16_t(gy);
    }
};

// Straightforward detector: magnitudes, suppression, then growth by a
// breadth-first search (the result does not depend on the visiting order).
std::vector<uint8_t> reference(const Grad& g, float low, float high) {
    const int w = g.w, h = g.h;
    const int L = int(low);
    auto mag = [&](int x, int y) -> int {
        if (x < 0 || y < 0 || x >= w || y >= h) return 0;
        const int m = std::abs(int(g.dx[size_t(y) * w + x])) + std::abs(int(g.dy[size_t(y) * w + x]));
        return m > L ? m : 0;
    };
    std::vector<uint8_t> cand(size_t(w) * h), out(size_t(w) * h);
    std::vector<int> todo;
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            const int m = mag(x, y);
            if (m == 0) continue;
            const int gx = g.dx[size_t(y) * w + x], gy = g.dy[size_t(y) * w + x];
            const double ax = std::abs(gx), ay = std::abs(gy);
            bool keep;
            if (ay < 0.41421356237309503 * ax)
                keep = m > mag(x - 1, y) && m >= mag(x + 1, y);
            else if (ay <= 2.414213562373095 * ax)
                keep = (gx < 0) != (gy < 0) ? m > mag(x + 1, y - 1) && m > mag(x - 1, y + 1)
                                            : m > mag(x - 1, y - 1) && m > mag(x + 1, y + 1);
            else
                keep = m > mag(x, y - 1) && m >= mag(x, y + 1);
            if (!keep) continue;
            cand[size_t(y) * w + x] = 1;
            if (float(m) > high) {
                out[size_t(y) * w + x] = 255;
                todo.push_back(y * w + x);
            }
        }
    for (size_t i = 0; i < todo.size(); ++i) {
        const int x0 = todo[i] % w, y0 = todo[i] / w;
        for (int dy = -1; dy <= 1; ++dy)
            for (int dx = -1; dx <= 1; ++dx) {
                const int x = x0 + dx, y = y0 + dy;
                if (x < 0 || y < 0 || x >= w || y >= h) continue;
                const size_t k = size_t(y) * w + x;
                if (cand[k] && !out[k]) {
                    out[k] = 255;
                    todo.push_back(int(k));
                }
            }
    }
    return out;
}

// Runs the detector with guarded inputs, a buffer of exactly the reported
// size, and a destination whose rows are wider than the ROI.
std::vector<uint8_t> run(const zt::Api& z, const Grad& g, float low, float high, Status* st = nullptr,
                         int extra = 3) {
    const int w = g.w, h = g.h;
    zt::GuardedImage<int16_t> dx(w, h, 0, 2), dy(w, h, 0, 0, zt::Guard::Before);
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            *dx.at(x, y) = g.dx[size_t(y) * w + x];
            *dy.at(x, y) = g.dy[size_t(y) * w + x];
        }
    int size = 0;
    EXPECT_EQ(zt::api(0).zoriCannyGetSize({w, h}, &size), StatusOk);
    zt::GuardedBuffer buf(size_t(size), w % 2 ? zt::Guard::After : zt::Guard::Before);
    std::memset(buf.data(), 0xCD, buf.size());
    // exactly height * step bytes: the last row's padding is cleared too
    const int step = w + extra;
    zt::GuardedBuffer dst(size_t(h) * size_t(step));
    std::memset(dst.data(), 0x5A, dst.size());
    const Status s = z.zoriCanny_16s8u_C1R(dx.roi(), dx.step(), dy.roi(), dy.step(), dst.data(), step,
                                           {w, h}, low, high, buf.data());
    if (st) *st = s;
    for (int y = 0; y < h; ++y)
        for (int x = w; x < step; ++x) EXPECT_EQ(dst.data()[size_t(y) * step + x], 0) << x << "," << y;
    std::vector<uint8_t> out(size_t(w) * h);
    for (int y = 0; y < h; ++y) std::memcpy(&out[size_t(y) * w], dst.data() + size_t(y) * step, size_t(w));
    return out;
}

TEST_P(Canny, RandomGradientsMatchReference) {
    std::mt19937 rng(41 + variant());
    for (int trial = 0; trial < 12; ++trial) {
        const int w = 1 + int(rng() % 45), h = 1 + int(rng() % 20);
        Grad g(w, h);
        const int range = trial % 3 == 0 ? 3 : trial % 3 == 1 ? 60 : 32768;  // small ranges: many ties
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                g.set(x, y, int(rng() % (2 * range)) - range, int(rng() % (2 * range)) - range);
        const float low = trial % 3 == 2 ? 3000.0f : float(rng() % 20) + 0.7f;
        const float high = low * 2.5f;
        Status st;
        const auto got = run(z(), g, low, high, &st);
        ASSERT_EQ(st, StatusOk);
        ASSERT_EQ(got, reference(g, low, high)) << "trial " << trial;
    }
}

// Smooth random pictures give long, connected edges: growth runs across many
// rows, also upwards, and through rows far above the one being suppressed.
TEST_P(Canny, TallPicturesMatchReference) {
    std::mt19937 rng(7 + variant());
    for (int trial = 0; trial < 6; ++trial) {
        const int w = 8 + int(rng() % 60), h = 30 + int(rng() % 70);
        std::vector<double> f(size_t(w + 2) * (h + 2));
        for (int b = 0; b < 12; ++b) {  // a few blobs
            const double cx = rng() % (w + 2), cy = rng() % (h + 2), r = 3 + rng() % 15, a = int(rng() % 200) - 100;
            for (int y = 0; y < h + 2; ++y)
                for (int x = 0; x < w + 2; ++x)
                    f[size_t(y) * (w + 2) + x] += a * std::exp(-((x - cx) * (x - cx) + (y - cy) * (y - cy)) / (r * r));
        }
        Grad g(w, h);
        auto F = [&](int x, int y) { return f[size_t(y + 1) * (w + 2) + size_t(x + 1)]; };
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x)
                g.set(x, y, int(8 * (F(x + 1, y) - F(x - 1, y))) + int(rng() % 5) - 2,
                      int(8 * (F(x, y + 1) - F(x, y - 1))) + int(rng() % 5) - 2);
        for (const float low : {1.0f, 20.0f, 60.5f}) {
            const float high = low * (trial % 2 ? 2.0f : 6.0f);
            ASSERT_EQ(run(z(), g, low, high), reference(g, low, high)) << trial << " " << low;
        }
    }
}

// A weak path that winds down and up over many rows, one strong pixel at
// its far end: the whole path becomes an edge (the growth must climb back
// into rows settled long before).
TEST_P(Canny, WindingPathGrowsBackUpwards) {
    const int w = 24, h = 80;
    Grad g(w, h);
    // columns 2, 6, 10, ... go down or up alternately, joined at the ends
    // (vertical runs of class 1, horizontal joins of class 3: each pixel is
    // alone along its own gradient, so all are candidates)
    std::vector<std::pair<int, int>> path;
    for (int c = 0; c < 5; ++c) {
        const int x = 2 + 4 * c;
        for (int i = 1; i < h - 1; ++i) {
            path.push_back({x, c % 2 ? h - 1 - i : i});
            g.set(x, path.back().second, 40, 0);
        }
        const int yEnd = c % 2 ? 1 : h - 2;
        for (int dx = 1; dx < 4 && c < 4; ++dx) {
            path.push_back({x + dx, yEnd});
            g.set(x + dx, yEnd, 0, -30);  // below the runs: no plateau with them
        }
    }
    g.set(path.back().first, path.back().second, 400, 0);  // the only strong pixel
    const auto e = run(z(), g, 10, 100);
    EXPECT_EQ(e, reference(g, 10, 100));
    for (const auto& p : path) ASSERT_EQ(e[size_t(p.second) * w + p.first], 255) << p.first << "," << p.second;
}

// Extreme derivatives: magnitudes up to 65536 side by side with 65535, and
// threshold edge values (low 0, low and high near and above 65535).
TEST_P(Canny, ExtremeMagnitudesAndThresholds) {
    std::mt19937 rng(99 + variant());
    static const int16_t vals[] = {-32768, -32767, 32767, 32766, 0, 1, -1, -16384};
    for (int trial = 0; trial < 6; ++trial) {
        const int w = 9 + int(rng() % 30), h = 3 + int(rng() % 12);
        Grad g(w, h);
        for (int y = 0; y < h; ++y)
            for (int x = 0; x < w; ++x) g.set(x, y, vals[rng() % 8], vals[rng() % 8]);
        const float lows[] = {0.0f, 1.0f, 65534.0f, 65535.0f, 65536.0f, 40000.0f};
        const float low = lows[trial];
        for (const float high : {low, low + 0.5f, 65535.0f, 65535.5f, 65536.0f, 1e30f}) {
            if (high < low) continue;
            ASSERT_EQ(run(z(), g, low, high), reference(g, low, high)) << trial << " " << low << " " << high;
        }
    }
    // ordinary edges over many rows, and the largest magnitude only in the
    // last row: everything before it is redone another way, same result
    Grad g(40, 50);
    for (int y = 0; y < g.h; ++y)
        for (int x = 0; x < g.w; ++x) g.set(x, y, (x * 7 + y * 3) % 11 == 0 ? 300 : int(rng() % 40), int(rng() % 90));
    g.set(17, 49, -32768, -32768);
    for (const float low : {0.0f, 30.0f})
        ASSERT_EQ(run(z(), g, low, 200), reference(g, low, 200)) << low;
}

TEST_P(Canny, SinglePixelsAndTies) {
    const auto& z = this->z();
    Grad zero(8, 6);
    for (uint8_t v : run(z, zero, 10, 50)) EXPECT_EQ(v, 0);
    Grad one(8, 6);
    one.set(3, 2, 100, 0);
    auto e = run(z, one, 10, 50);
    for (int i = 0; i < 48; ++i) EXPECT_EQ(e[size_t(i)], i == 2 * 8 + 3 ? 255 : 0);
    // horizontal plateau: the left one survives
    Grad pair(8, 6);
    pair.set(3, 2, 100, 0);
    pair.set(4, 2, 100, 0);
    e = run(z, pair, 10, 50);
    EXPECT_EQ(e[2 * 8 + 3], 255);
    EXPECT_EQ(e[2 * 8 + 4], 0);
    // vertical plateau: the upper one survives
    Grad vpair(8, 6);
    vpair.set(3, 2, 0, -100);
    vpair.set(3, 3, 0, -100);
    e = run(z, vpair, 10, 50);
    EXPECT_EQ(e[2 * 8 + 3], 255);
    EXPECT_EQ(e[3 * 8 + 3], 0);
    // diagonal (class 4, same signs) neighbours of equal magnitude: both suppressed
    Grad diag(8, 6);
    diag.set(3, 2, 50, 50);
    diag.set(4, 3, 50, 50);
    e = run(z, diag, 10, 50);
    EXPECT_EQ(e[2 * 8 + 3], 0);
    EXPECT_EQ(e[3 * 8 + 4], 0);
    // class 2 (signs differ) compares upper right and lower left, not upper left
    Grad d2(8, 6);
    d2.set(3, 2, 50, -50);
    d2.set(4, 3, 60, -60);  // lower right: not compared
    e = run(z, d2, 10, 50);
    EXPECT_EQ(e[2 * 8 + 3], 255);
    // the largest magnitude, 65536, from the most negative derivatives
    Grad big(16, 3);
    big.set(9, 1, -32768, -32768);
    e = run(z, big, 65535, 65535.5f);
    EXPECT_EQ(e[1 * 16 + 9], 255);
    // high threshold equal to the magnitude is not strong
    e = run(z, one, 10, 100);
    EXPECT_EQ(e[2 * 8 + 3], 0);
    // the low threshold truncates: 10.9 acts as 10
    Grad ten(8, 6);
    ten.set(1, 1, 200, 0);
    ten.set(2, 2, 10, 0);
    ten.set(0, 2, 11, 0);
    e = run(z, ten, 10.9f, 50);
    EXPECT_EQ(e[1 * 8 + 1], 255);
    EXPECT_EQ(e[2 * 8 + 2], 0);   // 10: cleared
    EXPECT_EQ(e[2 * 8 + 0], 255); // 11: kept, touches the edge
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
        for (int j = 0; j < rows; ++j)
            for (int i = 0; i < cols; ++i) {
                const int k = j * cols + i, x = 3 * i, y = 3 * j;
                const bool vertical = k % 2;
                int ax = vertical ? 1 + int(rng() % 13500) : 1 + int(rng() % 32768);
                if (k < 16) ax = vertical ? 1 + k / 2 : 32768 - k / 2;  // the ends of the ranges
                const int ay = vertical ? above67(ax) - int(k / 2 % 2) : below22(ax) + int(k / 2 % 2);
                const int sx = rng() % 2 ? 1 : -1, sy = rng() % 2 ? 1 : -1;
                g.set(x, y, ax == 32768 ? -32768 : sx * ax, sy * ay);
                if (vertical) g.set(x, y + 1, 32767, 32767);
                else g.set(x + 1, y, 32767, 32767);
            }
        ASSERT_EQ(run(z(), g, 1, 2), reference(g, 1, 2)) << image;
    }
}

TEST_P(Canny, HysteresisFollowsEightNeighbours) {
    const auto& z = this->z();
    // a weak chain touching a strong pixel becomes an edge, in every direction
    for (int k = 0; k < 8; ++k) {
        static const int ox[8] = {-1, 0, 1, -1, 1, -1, 0, 1}, oy[8] = {-1, -1, -1, 0, 0, 1, 1, 1};
        Grad g(9, 9);
        g.set(4, 4, 0, 0);
        // isolated pixels of class 1 keep their own magnitude as maxima
        g.set(4, 4, 300, 0);
        g.set(4 + 2 * ox[k], 4 + 2 * oy[k], 30, 0);   // weak, touching only another weak one
        g.set(4 + ox[k], 4 + oy[k], 0, 0);
        const auto e = run(z, g, 10, 100);
        EXPECT_EQ(e[4 * 9 + 4], 255);
        EXPECT_EQ(e[size_t(4 + 2 * oy[k]) * 9 + size_t(4 + 2 * ox[k])], 0) << k;
        Grad g2(9, 9);
        g2.set(4, 4, 300, 0);
        if (ox[k] != 0) g2.set(4 + ox[k], 4 + oy[k], 0, 30);  // class 3 beside a class 1 pixel
        else g2.set(4 + ox[k], 4 + oy[k], 30, 0);
        const auto e2 = run(z, g2, 10, 100);
        EXPECT_EQ(e2[size_t(4 + oy[k]) * 9 + size_t(4 + ox[k])], 255) << k;
    }
}

TEST_P(Canny, ChecksAndSizes) {
    const auto& z = this->z();
    int n = 0;
    EXPECT_EQ(z.zoriCannyGetSize({3, 2}, &n), StatusOk);
    EXPECT_EQ(n, 5 * 5 * 4 + 16 * 3 + 160);
    EXPECT_EQ(z.zoriCannyGetSize({65532, 1}, &n), StatusOk);
    EXPECT_EQ(n, 5 * 65534 * 3 + 16 * 65532 + 160);
    EXPECT_EQ(z.zoriCannyGetSize({65533, 1}, &n), StatusOk);
    EXPECT_EQ(n, 9 * 65535 * 3 + 16 * 65533 + 160);
    EXPECT_EQ(z.zoriCannyGetSize({1, 65533}, &n), StatusOk);
    EXPECT_EQ(n, 9 * 65535 * 3 + 16 + 160);
    EXPECT_EQ(z.zoriCannyGetSize({0, 1}, nullptr), StatusNullPointer);
    EXPECT_EQ(z.zoriCannyGetSize({0, 1}, &n), StatusBadSize);

    int16_t dx[64] = {}, dy[64] = {};
    uint8_t d[64], buf[2048];
    std::memset(d, 7, sizeof d);
    const ImageSize roi{4, 2};
    auto c = z.zoriCanny_16s8u_C1R;
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, {0, 0}, 1, 2, nullptr), StatusNullPointer);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, {0, 2}, -1, 2, buf), StatusBadSize);
    EXPECT_EQ(c(dx, 7, dy, 0, d, 0, roi, -1, 2, buf), StatusBadStep);
    EXPECT_EQ(c(dx, 8, dy, 7, d, 4, roi, -1, 2, buf), StatusBadStep);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 3, roi, -1, 2, buf), StatusBadStep);
    EXPECT_EQ(c(dx, 9, dy, 8, d, 4, roi, -1, 2, buf), StatusNotEvenStep);
    EXPECT_EQ(c(dx, 8, dy, 11, d, 4, roi, -1, 2, buf), StatusNotEvenStep);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, roi, -1, 2, buf), StatusBadArgument);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, roi, 5, 4, buf), StatusBadArgument);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, roi, std::numeric_limits<float>::quiet_NaN(), 4, buf), StatusBadArgument);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, roi, 1, std::numeric_limits<float>::quiet_NaN(), buf), StatusBadArgument);
    for (uint8_t v : d) EXPECT_EQ(v, 7);
    EXPECT_EQ(c(dx, 8, dy, 8, d, 4, roi, 5, 5, buf), StatusOk);
    for (int i = 0; i < 8; ++i) EXPECT_EQ(d[i], 0);
    EXPECT_EQ(d[8], 7);
}

TEST_P(Canny, WideCoordinates) {
    // a padded width of 65535 switches the stack to 32-bit coordinates
    Grad g(65533, 1);
    for (int x = 0; x < g.w; x += 7) g.set(x, 0, x % 3 ? 40 : 200, 0);
    g.set(65532, 0, 200, 0);
    g.set(65531, 0, 20, 20);
    const auto e = run(z(), g, 10, 100, nullptr, 0);
    EXPECT_EQ(e, reference(g, 10, 100));
    EXPECT_EQ(e[65532], 255);
}

}  // namespace

ZT_ALL_VARIANTS(Canny);
