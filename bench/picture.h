// The benchmarks' test picture: smooth shading, a few shapes and mild
// noise, the same on every run.
#pragma once

#include <opencv2/core.hpp>

#include <cmath>
#include <cstdint>

namespace zb {

// An 8-bit one-channel picture of w x h pixels.
inline cv::Mat testPicture(int w, int h) {
    cv::Mat m(h, w, CV_8UC1);
    uint32_t r = 12345;
    for (int y = 0; y < h; ++y)
        for (int x = 0; x < w; ++x) {
            r = r * 1664525u + 1013904223u;
            double v = 110 + 50 * std::sin(x / 57.0) * std::cos(y / 41.0);
            if ((x / 160 + y / 120) % 3 == 0) v += 60;
            const double cx = x - w / 2.0, cy = y - h / 2.0;
            if (cx * cx + cy * cy < 300.0 * 300.0) v -= 70;
            v += double(r >> 28) - 8;
            m.at<uint8_t>(y, x) = cv::saturate_cast<uint8_t>(v);
        }
    return m;
}

}  // namespace zb
