// The guarded-buffer helper itself: the guards fault, the layout is as
// documented, and writes outside the ROI are seen.
#include <gtest/gtest.h>

#include <cstdint>

#include "tests/support/guarded.h"

using zt::Guard;
using zt::GuardedBuffer;
using zt::GuardedImage;

TEST(Guarded, BufferUsableEndToEnd) {
    for (size_t n : {size_t(1), size_t(7), size_t(4096), size_t(5000)}) {
        GuardedBuffer after(n), before(n, Guard::Before);
        for (size_t i = 0; i < n; ++i) after.data()[i] = before.data()[i] = static_cast<uint8_t>(i);
        EXPECT_EQ(after.data()[n - 1], static_cast<uint8_t>(n - 1));
    }
}

#if !defined(_WIN32)
TEST(GuardedDeathTest, OneByteOutsideFaults) {
    GTEST_FLAG_SET(death_test_style, "threadsafe");
    EXPECT_DEATH(
        {
            GuardedBuffer b(100);
            volatile uint8_t* p = b.data();
            (void)p[100];
        },
        "");
    EXPECT_DEATH(
        {
            GuardedBuffer b(100, Guard::Before);
            volatile uint8_t* p = b.data();
            p[-1] = 0;
        },
        "");
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
    EXPECT_TRUE(img.outsideIntact());
    EXPECT_EQ(*img.at(4, 2), 24);  // ROI keeps its contents
    *img.at(5, 1) = 0;             // one past the ROI's right edge
    EXPECT_FALSE(img.outsideIntact());
    img.markOutside();
    *img.at(0, -1) = 0;            // the row above
    EXPECT_FALSE(img.outsideIntact());
    img.markOutside();
    for (int y = 0; y < 3; ++y)
        for (int x = 0; x < 5; ++x) *img.at(x, y) = 0;
    EXPECT_TRUE(img.outsideIntact());
}

TEST(Guarded, ImageLastRowEndsAtTheGuard) {
    GuardedImage<uint8_t> img(7, 4);
    volatile uint8_t* last = img.at(6, 3);
    *last = 1;  // the very last byte is ours
    EXPECT_EQ(img.step(), 7);
}
