/* A first program against an installed zor: the version records of the
 * bound variant, then Canny edges of a small synthetic picture, chained the
 * right way (the Vert Sobel filter gives left minus right; Canny wants dx as
 * right minus left), and one failing call with its status.
 *
 * Build with CMake (find_package(zor), target zor::zor) or with pkg-config:
 *     cc hello.c $(pkg-config --cflags --libs zor) -o hello */
#include <stdio.h>
#include <stdlib.h>

#include <zor.h>

enum { W = 64, H = 48, B = 1 };  /* picture size, border the 3x3 filters read */

int main(void) {
    const LibraryVersion* v = zoriGetLibVersion();
    static uint8_t picture[(H + 2 * B) * (W + 2 * B)];
    static int16_t dx[H * W], dy[H * W];
    static uint8_t edges[H * W];
    const int step = W + 2 * B;
    const uint8_t* roi = picture + B * step + B;
    ImageSize size = {W, H};
    int x, y, bytes = 0, count = 0;
    uint8_t* buffer;
    Status s;

    printf("zor %s, build %d.%d, variant %s (%s)\n", v->versionText, v->buildSeries, v->build, v->cpuTag,
           v->libraryName);

    /* A bright disc on a dark ground, with its border pixels. */
    for (y = 0; y < H + 2 * B; ++y)
        for (x = 0; x < W + 2 * B; ++x) {
            const int cx = x - B - W / 2, cy = y - B - H / 2;
            picture[y * step + x] = cx * cx + cy * cy < 15 * 15 ? 200 : 40;
        }

    s = zoriFilterSobelVert_8u16s_C1R(roi, step, dx, 2 * W, size, MaskSize3x3);
    if (s == StatusOk) s = zoriFilterSobelHoriz_8u16s_C1R(roi, step, dy, 2 * W, size, MaskSize3x3);
    if (s == StatusOk) s = zorsMulC_NR_16s_ISfs(-1, dx, W * H, 0); /* dx = right minus left */
    if (s == StatusOk) s = zoriCannyGetSize(size, &bytes);
    if (s != StatusOk) {
        printf("failed: status %d\n", (int)s);
        return 1;
    }
    buffer = (uint8_t*)malloc((size_t)bytes);
    s = zoriCanny_16s8u_C1R(dx, 2 * W, dy, 2 * W, edges, W, size, 100.0f, 300.0f, buffer);
    free(buffer);
    for (x = 0; x < W * H; ++x) count += edges[x] != 0;
    printf("canny: status %d, %d edge pixels around the disc\n", (int)s, count);

    /* Arguments are checked before anything is written. */
    size.width = 0;
    printf("zoriCannyGetSize with width 0: status %d (StatusBadSize is %d)\n",
           (int)zoriCannyGetSize(size, &bytes), (int)StatusBadSize);
    return s == StatusOk && count > 0 ? 0 : 1;
}
