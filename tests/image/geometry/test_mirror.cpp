// Mirrors on every variant against a direct index map: pixel (x, y) takes
// the pixel at its mirror position (in place, alpha stays put).
#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <type_traits>
#include <vector>

#include "tests/image/pixel/pixel_test_util.h"
#include "tests/support/checks.h"
#include "tests/support/variants.h"

namespace {

template <class T>
using Img = zt::GuardedImage<T>;

class Mirror : public zt::VariantTest {};

// Axis 0 flips the rows, 1 the columns, 2 both; in-place forms get the
// source copied into the destination image first.
template <class T, int C, class F>
::testing::AssertionResult mirrors(F fn, int flip) {
    constexpr bool inPlace = std::is_invocable_v<F, T*, int, ImageSize, int>;
    return zpt::movesAsExpected<T, T>(
        C, C, flip * 10 + C,
        [&](Img<T>& s, Img<T>& d, ImageSize r) {
            if constexpr (inPlace) {
                for (int y = 0; y < r.height; ++y) std::memcpy(d.at(0, y), s.at(0, y), sizeof(T) * C * r.width);
                return fn(d.roi(), d.step(), r, flip);
            } else {
                return fn(s.roi(), s.step(), d.roi(), d.step(), r, flip);
            }
        },
        [&](const std::vector<T>& s, std::vector<T>& d, ImageSize r) {
            for (int y = 0; y < r.height; ++y)
                for (int x = 0; x < r.width; ++x) {
                    const int sx = flip == 0 ? x : r.width - 1 - x, sy = flip == 1 ? y : r.height - 1 - y;
                    for (int k = 0; k < C; ++k)
                        d[(size_t(y) * r.width + x) * C + k] =
                            inPlace && k == 3 ? s[(size_t(y) * r.width + x) * C + k] : s[(size_t(sy) * r.width + sx) * C + k];
                }
        });
}

TEST_P(Mirror, EveryFormAndAxis) {
    for (int flip : {0, 1, 2}) {
        EXPECT_TRUE((mirrors<uint8_t, 3>(z().zoriMirror_8u_C3R, flip))) << flip;
        EXPECT_TRUE((mirrors<int32_t, 3>(z().zoriMirror_32s_C3R, flip))) << flip;
        EXPECT_TRUE((mirrors<uint8_t, 1>(z().zoriMirror_8u_C1IR, flip))) << flip;
        EXPECT_TRUE((mirrors<uint8_t, 3>(z().zoriMirror_8u_C3IR, flip))) << flip;
        EXPECT_TRUE((mirrors<uint8_t, 4>(z().zoriMirror_8u_AC4IR, flip))) << flip;
        EXPECT_TRUE((mirrors<uint16_t, 1>(z().zoriMirror_16u_C1IR, flip))) << flip;
        EXPECT_TRUE((mirrors<uint16_t, 3>(z().zoriMirror_16u_C3IR, flip))) << flip;
        EXPECT_TRUE((mirrors<uint16_t, 4>(z().zoriMirror_16u_AC4IR, flip))) << flip;
    }
}

// Pointers, size, then the axis; no step is checked: a zero step with axis 1
// mirrors the one row it sees, a negative one walks upwards.
TEST_P(Mirror, Checks) {
    const zt::Api& a = z();
    uint8_t s[32] = {}, d[32] = {};
    const std::vector<zt::Watch> w{zt::watch(d, sizeof d)};
    zt::expectChecks(a.zoriMirror_8u_C1IR, {d, 4, ImageSize{2, 2}, 1}, w, zt::eachNull(), zt::badRoi<2>(),
                     zt::bad(StatusBadFlip, zt::arg<3>(3)), zt::bad(StatusBadFlip, zt::arg<3>(-1)),
                     zt::bad(StatusNullPointer, zt::arg<0>(nullptr), zt::arg<3>(3)),
                     zt::bad(StatusBadSize, zt::arg<2>(ImageSize{0, 5}), zt::arg<3>(3)));
    zt::expectChecks(a.zoriMirror_8u_C3R, {s, 6, d, 6, ImageSize{2, 2}, 2}, w, zt::eachNull(), zt::badRoi<4>(),
                     zt::bad(StatusBadFlip, zt::arg<5>(3)), zt::bad(StatusBadSize, zt::arg<4>(ImageSize{1, 0}), zt::arg<5>(3)));
    for (int i = 0; i < 32; ++i) s[i] = uint8_t(i + 1);
    EXPECT_EQ(a.zoriMirror_8u_C3R(s, 0, d, 6, {2, 2}, 1), StatusOk);
    const uint8_t expect[12] = {4, 5, 6, 1, 2, 3, 4, 5, 6, 1, 2, 3};
    EXPECT_EQ(0, std::memcmp(d, expect, 12));
    std::vector<uint16_t> v(24), ref(24);
    for (size_t i = 0; i < v.size(); ++i) v[i] = ref[i] = uint16_t(i * 1000 + 7);
    // the image seen bottom row first: both axes over it are both axes over the whole
    ASSERT_EQ(a.zoriMirror_16u_C3IR(v.data() + 18, -12, {2, 4}, 2), StatusOk);
    ASSERT_EQ(a.zoriMirror_16u_C3IR(ref.data(), 12, {2, 4}, 2), StatusOk);
    EXPECT_EQ(v, ref);
}

ZT_ALL_VARIANTS(Mirror);

}  // namespace
