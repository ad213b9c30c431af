// Shared helpers of the pixel-mover tests: random guarded images in several
// shapes (odd widths around the 16- and 48-byte blocks, packed and padded
// rows, aligned and unaligned first pixels).
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <random>
#include <type_traits>
#include <vector>

#include "tests/support/guarded.h"
#include "zor.h"

namespace zpt {

// ROI sizes in pixels: widths around every block boundary the kernels use.
inline const std::vector<ImageSize>& shapes() {
    static const std::vector<ImageSize> s = {{1, 1},  {2, 3},  {3, 2},  {5, 1},  {7, 3},  {15, 2}, {16, 2},
                                             {17, 3}, {21, 1}, {31, 2}, {32, 1}, {33, 3}, {47, 2}, {48, 1},
                                             {49, 2}, {50, 3}, {64, 1}, {65, 2}, {97, 3}, {100, 2}};
    return s;
}

// A layout of the guarded image: row padding in elements, and whether the
// ROI sits inside a one-pixel border (unaligned start, rows not packed) or
// flush against the guard after the data.
struct Layout {
    int padElems;
    bool bordered;
};
inline const std::vector<Layout>& layouts() {
    static const std::vector<Layout> l = {{0, false}, {3, false}, {0, true}, {1, true}};
    return l;
}

template <class T>
std::unique_ptr<zt::GuardedImage<T>> image(ImageSize roi, int channels, Layout l, std::mt19937& rng) {
    auto g = std::make_unique<zt::GuardedImage<T>>(roi.width * channels, roi.height, l.bordered ? 1 : 0,
                                                   l.padElems * static_cast<int>(sizeof(T)),
                                                   l.bordered ? zt::Guard::Before : zt::Guard::After, channels);
    for (int y = 0; y < roi.height; ++y)
        for (int x = 0; x < roi.width * channels; ++x) {
            const uint32_t r = rng();
            std::memcpy(g->at(x, y), &r, sizeof(T));
        }
    return g;
}

// The ROI's elements, row after row.
template <class T>
std::vector<T> contents(const zt::GuardedImage<T>& g) {
    std::vector<T> v;
    for (int y = 0; y < g.height(); ++y) v.insert(v.end(), g.at(0, y), g.at(0, y) + g.width());
    return v;
}

// For every size and pair of layouts (packed or not on either side): a
// random source of sc-element pixels and a random destination of
// dc-element ones; run(src, dst, roi) calls the export (it may first put
// other values into the source) and expect(s, d) turns the source's and
// the destination's contents into what the destination must hold (given
// the ROI size too, if it takes a third argument); nothing outside its ROI
// may change.
template <class S, class D, class Run, class Expect>
::testing::AssertionResult movesAsExpected(int sc, int dc, uint32_t seed, Run run, Expect expect,
                                           const std::vector<ImageSize>& sizes = shapes()) {
    const Layout pairs[][2] = {{{0, false}, {0, false}}, {{0, false}, {2, true}}, {{3, false}, {0, false}},
                               {{0, true}, {1, true}},   {{1, true}, {3, false}}};
    std::mt19937 rng(seed);
    for (ImageSize roi : sizes)
        for (const auto& pair : pairs) {
            const Layout l = pair[0];
            auto src = image<S>(roi, sc, l, rng);
            auto dst = image<D>(roi, dc, pair[1], rng);
            std::vector<D> want = contents(*dst);
            if (run(*src, *dst, roi) != StatusOk) return ::testing::AssertionFailure() << "status";
            if constexpr (std::is_invocable_v<Expect, const std::vector<S>&, std::vector<D>&, ImageSize>)
                expect(contents(*src), want, roi);
            else
                expect(contents(*src), want);
            const std::vector<D> got = contents(*dst);
            for (size_t i = 0; i < got.size(); ++i)
                if (std::memcmp(&got[i], &want[i], sizeof(D)) != 0)
                    return ::testing::AssertionFailure() << roi.width << "x" << roi.height << ", pad " << l.padElems
                                                         << (l.bordered ? " bordered" : "") << ": element " << i;
            if (!dst->outsideIntact()) return ::testing::AssertionFailure() << roi.width << ": wrote outside";
        }
    return ::testing::AssertionSuccess();
}

}  // namespace zpt
