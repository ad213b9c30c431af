// Flood fills against a breadth-first search over the picture as it was:
// every form, random pictures and windows, buffers of exactly the size
// asked for against a guard page (regions that outgrow the stack included),
// the pinned cases, the checks and the agreement of the variants.
#include <cstring>
#include <queue>
#include <random>
#include <vector>

#include "tests/support/agree.h"
#include "tests/support/checks.h"
#include "tests/support/guarded.h"
#include "tests/support/variants.h"

namespace {

class FloodFill : public zt::VariantTest {};

enum Form { Plain, Grad4, Grad8 };
using Picture = std::vector<uint8_t>;  // w x h, dense

Status fill(const zt::Api& z, Form f, uint8_t* p, int step, ImageSize roi, ImagePoint seed, uint8_t value, int lo,
            int hi, ConnectedComp* r) {
    int size = 0;
    EXPECT_EQ((f == Plain ? z.zoriFloodFillGetSize : z.zoriFloodFillGetSize_Grad)(roi, &size), 0);
    zt::GuardedBuffer buffer{size_t(size)};
    if (f == Plain) return z.zoriFloodFill_4Con_8u_C1IR(p, step, roi, seed, value, r, buffer.data());
    return (f == Grad4 ? z.zoriFloodFill_Grad4Con_8u_C1IR : z.zoriFloodFill_Grad8Con_8u_C1IR)(
        p, step, roi, seed, value, uint8_t(lo), uint8_t(hi), r, buffer.data());
}

// Fills the picture through f on a guarded image and compares the pixels and
// the record with a breadth-first search: a neighbour joins when it equals
// the seed (Plain) or lies in [c - lo, c + hi] of the pixel c it is reached from.
void expectFill(const zt::Api& z, Form f, const Picture& pic, int w, int h, ImagePoint seed, uint8_t value, int lo,
                int hi) {
    std::vector<uint8_t> in(pic.size());
    std::queue<int> queue;
    ConnectedComp e{0, {double(value), 0, 0}, {seed.x, seed.y, seed.x, seed.y}};  // rect: corners for now
    for (queue.push(seed.y * w + seed.x), in[queue.front()] = 1; !queue.empty(); queue.pop()) {
        const int p = queue.front(), x = p % w, y = p / w, c = pic[p];
        e.area += 1;
        e.rect = {std::min(e.rect.x, x), std::min(e.rect.y, y), std::max(e.rect.width, x), std::max(e.rect.height, y)};
        for (int dy = -1; dy <= 1; ++dy)
            for (int dx = -1; dx <= 1; ++dx) {
                const int X = x + dx, Y = y + dy, q = Y * w + X;
                if ((dx && dy && f != Grad8) || X < 0 || Y < 0 || X >= w || Y >= h || in[q]) continue;
                if (f == Plain ? pic[q] == pic[p] : c - lo <= pic[q] && pic[q] <= c + hi) queue.push(q), in[q] = 1;
            }
    }
    e.rect.width -= e.rect.x - 1, e.rect.height -= e.rect.y - 1;
    const bool untouched = f == Plain && pic[seed.y * w + seed.x] == value;
    zt::GuardedImage<uint8_t> img(w, h, 0, 3, h % 2 ? zt::Guard::After : zt::Guard::Before);
    img.fill([&](int x, int y) { return pic[y * w + x]; });
    ConnectedComp r, before;
    std::memset(&r, 0x5a, sizeof r), before = r;
    ASSERT_EQ(fill(z, f, img.roi(), img.step(), {w, h}, seed, value, lo, hi, &r), StatusOk);
    for (int i = 0; i < w * h; ++i)
        ASSERT_EQ(*img.at(i % w, i / w), in[i] && !untouched ? value : pic[i]) << w << "x" << h << " form " << f;
    EXPECT_TRUE(img.outsideIntact());
    const ConnectedComp& want = untouched ? before : e;  // a seed that holds the value: no record either
    EXPECT_EQ(std::memcmp(&r, &want, sizeof r), 0) << r.area << " " << r.rect.x << " " << r.rect.y << " "
                                                   << r.rect.width << " " << r.rect.height;
}

TEST_P(FloodFill, MatchesBreadthFirst) {
    std::mt19937 rng(7);
    for (int k = 0; k < 600; ++k) {
        const int w = 1 + rng() % 40, h = 1 + rng() % 12, levels = 1 + rng() % 3, noise = rng() % 3 * 4, base = rng() % 2 * 247;
        Picture pic(size_t(w) * h);
        for (uint8_t& p : pic) p = uint8_t(base + rng() % levels * 125 + rng() % (noise + 1));  // windows reach past 255
        const Form f = Form(k % 3);
        expectFill(z(), f, pic, w, h, {int(rng() % w), int(rng() % h)}, uint8_t(k % 5 ? rng() : pic[0]),
                   rng() % 6, rng() % 6);
    }
}

// Runs of one row fed from both sides of the seed, or touching runs: more
// entries than the buffer has room for at once.
TEST_P(FloodFill, RegionsThatOutgrowTheStack) {
    for (int w : {3, 5, 401}) {  // full middle row, combs above and below
        Picture comb(size_t(w) * 3);
        for (int i = 0; i < w * 3; ++i) comb[i] = i / w == 1 || i % 2 == 0 ? 0 : 9;
        expectFill(z(), Plain, comb, w, 3, {w / 2, 1}, 1, 0, 0);
    }
    Picture steps(64 * 64);  // rows of 10, and rows of 9 and 11 alternating
    for (int i = 0; i < 64 * 64; ++i) steps[i] = i / 64 % 2 == 0 ? 10 : i % 2 ? 9 : 11;
    for (Form f : {Grad4, Grad8}) expectFill(z(), f, steps, 64, 64, {0, 0}, 200, 1, 1);
}

TEST_P(FloodFill, SizesAndChecks) {
    int size = 0;
    EXPECT_EQ(z().zoriFloodFillGetSize({7, 5}, &size), 0);
    EXPECT_EQ(size, 6 * 35 + 32);
    EXPECT_EQ(z().zoriFloodFillGetSize_Grad({7, 5}, &size), 0);
    EXPECT_EQ(size, 9 * 7 + 6 * 35 + 32);
    EXPECT_EQ(z().zoriFloodFillGetSize_Grad({7, 0}, &size) | z().zoriFloodFillGetSize({7, 5}, nullptr), -6 | -8);
    std::vector<uint8_t> img(40, 3), buffer(9 * 6 + 6 * 40 + 32);
    ConnectedComp r;
    zt::expectChecks(z().zoriFloodFill_4Con_8u_C1IR, {img.data(), 8, {8, 5}, {7, 4}, 1, &r, buffer.data()},
                     {zt::watch(img), zt::watch(&r, sizeof r)}, zt::eachNull(), zt::bad(-6, zt::arg<2>(ImageSize{0, 5})),
                     zt::bad(-14, zt::arg<1>(7)), zt::bad(-11, zt::arg<3>(ImagePoint{8, 0})),
                     zt::bad(-11, zt::arg<3>(ImagePoint{0, -1})), zt::bad(-8, zt::arg<6>(nullptr), zt::arg<1>(0)),
                     zt::bad(-6, zt::arg<2>(ImageSize{8, 0}), zt::arg<1>(0)), zt::bad(-14, zt::arg<1>(0), zt::arg<3>(ImagePoint{9, 9})));
    zt::expectChecks(z().zoriFloodFill_Grad8Con_8u_C1IR, {img.data(), 8, {8, 5}, {0, 0}, 1, 2, 2, &r, buffer.data()},
                     {zt::watch(img), zt::watch(&r, sizeof r)}, zt::eachNull(), zt::bad(-6, zt::arg<2>(ImageSize{8, -1})),
                     zt::bad(-14, zt::arg<1>(7), zt::arg<3>(ImagePoint{0, 5})), zt::bad(-11, zt::arg<3>(ImagePoint{0, 5})));
}

TEST_P(FloodFill, VariantsAgree) {
    for (Form f : {Plain, Grad4, Grad8})
        zt::agreesWithGeneric(variant(), [f](const zt::Api& z, zt::Case& c) {
            const ImageSize roi = c.roi();
            const auto img = c.outImage<uint8_t>(roi.width, roi.height);
            for (int y = 0; y < roi.height; ++y)
                for (int x = 0; x < roi.width; ++x) img.p[y * img.step + x] = uint8_t(c.rng()() % 3 * 50 + c.rng()() % 3);
            const ImagePoint seed{int(c.rng()() % roi.width), int(c.rng()() % roi.height)};
            return fill(z, f, img.p, img.step, roi, seed, 77, 1, 2, c.out<ConnectedComp>(1));
        });
}

ZT_ALL_VARIANTS(FloodFill);

}  // namespace
