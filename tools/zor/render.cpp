// Pictures of numbers: heat maps of spectra and features, line plots.
#include <algorithm>
#include <cmath>

#include "tools/zor/tool.h"

namespace ztool {
namespace {

struct Rgb {
    double r, g, b;
};

// A dark-to-bright ramp (black, purple, red, orange, pale yellow) that stays
// readable in grey, and a blue-white-red one for signed values.
Rgb ramp(double t, bool diverging) {
    static const Rgb heat[] = {{0, 0, 4}, {87, 16, 110}, {188, 55, 84}, {249, 142, 9}, {252, 255, 164}};
    static const Rgb signedRamp[] = {{33, 102, 172}, {146, 197, 222}, {247, 247, 247}, {244, 165, 130}, {178, 24, 43}};
    const Rgb* c = diverging ? signedRamp : heat;
    t = std::min(1.0, std::max(0.0, t)) * 4;
    const int i = std::min(3, static_cast<int>(t));
    const double f = t - i;
    return {c[i].r + f * (c[i + 1].r - c[i].r), c[i].g + f * (c[i + 1].g - c[i].g), c[i].b + f * (c[i + 1].b - c[i].b)};
}

double quantile(std::vector<float> v, double q) {
    const size_t k = std::min(v.size() - 1, static_cast<size_t>(q * (v.size() - 1)));
    std::nth_element(v.begin(), v.begin() + static_cast<long>(k), v.end());
    return v[k];
}

void put(Image& img, int x, int y, const Rgb& c) {
    if (x < 0 || y < 0 || x >= img.width || y >= img.height) return;
    uint8_t* p = img.row(y) + 3 * x;
    p[0] = static_cast<uint8_t>(c.r);
    p[1] = static_cast<uint8_t>(c.g);
    p[2] = static_cast<uint8_t>(c.b);
}

}  // namespace

Image heatMap(const Plane& p, int xScale, int yScale, bool diverging, double range) {
    double lo = quantile(p.v, 0.01), hi = quantile(p.v, 0.995);
    if (range > 0) lo = std::max(lo, hi - range);
    if (diverging) {
        const double m = std::max(std::fabs(lo), std::fabs(hi));
        lo = -m;
        hi = m;
    }
    if (hi <= lo) hi = lo + 1;
    Image img(p.width * xScale, p.height * yScale, 3);
    for (int y = 0; y < img.height; ++y) {
        const int row = p.height - 1 - y / yScale;  // row 0 at the bottom
        for (int x = 0; x < img.width; ++x) put(img, x, y, ramp((p.at(x / xScale, row) - lo) / (hi - lo), diverging));
    }
    return img;
}

Image plotSeries(const std::vector<std::vector<double>>& series, int width, int height) {
    Image img(width, height, 3, 255);
    const Rgb colours[] = {{200, 30, 30}, {30, 150, 30}, {30, 60, 200}};
    const Rgb grid{225, 225, 225};
    for (int k = 1; k < 4; ++k) {
        for (int x = 0; x < width; ++x) put(img, x, k * height / 4, grid);
        for (int y = 0; y < height; ++y) put(img, k * width / 4, y, grid);
    }
    double top = 0;
    for (const auto& s : series)
        for (double v : s) top = std::max(top, v);
    if (top <= 0) top = 1;
    for (size_t k = 0; k < series.size() && k < 3; ++k) {
        const auto& s = series[k];
        if (s.size() < 2) continue;
        auto at = [&](size_t i, int& x, int& y) {
            x = static_cast<int>(std::lround(double(i) * (width - 1) / double(s.size() - 1)));
            y = height - 1 - static_cast<int>(std::lround(s[i] / top * (height - 4)));
        };
        for (size_t i = 1; i < s.size(); ++i) {
            int x0, y0, x1, y1;
            at(i - 1, x0, y0);
            at(i, x1, y1);
            const int steps = std::max(std::abs(x1 - x0), std::abs(y1 - y0)) + 1;
            for (int t = 0; t <= steps; ++t)
                for (int w = 0; w < 2; ++w)
                    put(img, x0 + (x1 - x0) * t / steps, y0 + (y1 - y0) * t / steps + w, colours[k]);
        }
    }
    return img;
}

}  // namespace ztool
