// The pixels of the benchmarks' test picture (smooth shading, a few shapes
// and mild noise, the same on every run), without OpenCV: the timing program
// of the 32-bit build uses it too.
#pragma once

#include <cmath>
#include <cstddef>
#include <cstdint>

namespace zb {

// Fills w x h pixels, rows `step` bytes apart.
inline void fillTestPicture(uint8_t* p, int w, int h, ptrdiff_t step) {
    uint32_t r = 12345;
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            r = r * 1664525u + 1013904223u;
            double v = 110 + 50 * std::sin(x / 57.0) * std::cos(y / 41.0);
            if ((x / 160 + y / 120) % 3 == 0) v += 60;
            const double cx = x - w / 2.0, cy = y - h / 2.0;
            if (cx * cx + cy * cy < 300.0 * 300.0) v -= 70;
            v += double(r >> 28) - 8;
            const long n = std::lrint(v);  // nearest, ties to even
            p[y * step + x] = static_cast<uint8_t>(n < 0 ? 0 : n > 255 ? 255 : n);
        }
}

}  // namespace zb
