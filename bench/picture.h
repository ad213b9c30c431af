// The benchmarks' test picture: smooth shading, a few shapes and mild
// noise, the same on every run.
#pragma once

#include <opencv2/core.hpp>

#include <cstdint>

#include "bench/picture_pixels.h"

namespace zb {

// An 8-bit one-channel picture of w x h pixels.
inline cv::Mat testPicture(int w, int h) {
    cv::Mat m(h, w, CV_8UC1);
    fillTestPicture(m.data, w, h, static_cast<ptrdiff_t>(m.step));
    return m;
}

}  // namespace zb
