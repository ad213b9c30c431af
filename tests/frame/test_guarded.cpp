// The guarded-buffer helper itself: the guards fault, the layout is as
// documented, and writes outside the ROI are seen.
#include <gtest/gtest.h>

#include <cstdint>

#include "tests/support/guarded.h"

using zt::Guard;
using zt::GuardedBuffer;
using zt::GuardedImage;

#if !defined(_WIN32)
TEST(GuardedDeathTest, OneByteOutsideFaults) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH({ (void)static_cast<volatile uint8_t*>(GuardedBuffer(100).data())[100]; }, "");
    EXPECT_DEATH({ static_cast<volatile uint8_t*>(GuardedBuffer(100, Guard::Before).data())[-1] = 0; }, "");
}
#endif

TEST(Guarded, ImageLayoutAndOutsideCheck) {
    GuardedImage<int16_t> img(5, 3, /*border*/ 2, /*pad*/ 6);
    EXPECT_EQ(img.step(), (5 + 4) * 2 + 6);
    EXPECT_EQ(reinterpret_cast<uint8_t*>(img.at(0, 1)) - reinterpret_cast<uint8_t*>(img.roi()), img.step());
    EXPECT_EQ(img.at(-2, -2) + 2, img.at(0, -2));
    img.fill([](int x, int y) { return x + 10 * y; });
    EXPECT_EQ(*img.at(-2, 4), -2 + 40);
    img.markOutside();
    EXPECT_TRUE(img.outsideIntact() && *img.at(4, 2) == 24);  // the ROI keeps its contents
    for (auto [x, y] : {std::pair{5, 1}, std::pair{0, -1}}) {  // one past the right edge, the row above
        *img.at(x, y) = 0;
        EXPECT_FALSE(img.outsideIntact());
        img.markOutside();
    }
    GuardedImage<uint8_t> packed(7, 4);
    *static_cast<volatile uint8_t*>(packed.at(6, 3)) = 1;  // the very last byte is ours
    EXPECT_EQ(packed.step(), 7);
}
