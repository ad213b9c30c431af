// Demo step of the QR solver: the grey image's shading fitted by a quadratic
// surface in the least-squares sense, and the image with that shading
// removed.
#include <algorithm>
#include <cmath>
#include <cstdio>

#include "tools/zor/demo.h"

namespace ztool {
namespace {

constexpr int kTerms = 6;  // 1, x, y, x^2, x y, y^2

// The terms at (x, y), both scaled to -1 .. 1 so the columns are alike in size.
void terms(const Image& img, int x, int y, double* t) {
    const double u = 2.0 * x / std::max(1, img.width - 1) - 1, v = 2.0 * y / std::max(1, img.height - 1) - 1;
    t[0] = 1, t[1] = u, t[2] = v, t[3] = u * u, t[4] = u * v, t[5] = v * v;
}

ZT_DEMO_STEP(75, "qr", "Least squares by QR",
             "A quadratic surface a + b x + c y + d x^2 + e x y + f y^2 fitted to every third pixel of the grey image "
             "(Householder QR of the 6-column design matrix, then back substitution), and the image with that "
             "shading taken out (plus its mean).",
             "zormQRDecomp_m_64f, zormQRBackSubst_mv_64f", [](Gallery& g) {
                 const Image& grey = g.grey();
                 std::vector<double> a, b;
                 for (int y = 0; y < grey.height; y += 3)
                     for (int x = 0; x < grey.width; x += 3) {
                         double t[kTerms];
                         terms(grey, x, y, t);
                         a.insert(a.end(), t, t + kTerms);
                         b.push_back(grey.row(y)[x]);
                     }
                 const int rows = static_cast<int>(b.size()), rowBytes = kTerms * 8;
                 std::vector<double> qr(a.size()), buffer(b.size()), coef(kTerms);
                 ZT_CALL(zormQRDecomp_m_64f(a.data(), rowBytes, 8, buffer.data(), qr.data(), rowBytes, 8, kTerms, rows));
                 ZT_CALL(zormQRBackSubst_mv_64f(qr.data(), rowBytes, 8, buffer.data(), b.data(), 8, coef.data(), 8,
                                                kTerms, rows));
                 Image surface(grey.width, grey.height, 1), flat(grey.width, grey.height, 1);
                 double se = 0;
                 for (int y = 0; y < grey.height; ++y)
                     for (int x = 0; x < grey.width; ++x) {
                         double t[kTerms], s = 0;
                         terms(grey, x, y, t);
                         for (int k = 0; k < kTerms; ++k) s += coef[k] * t[k];
                         const double r = grey.row(y)[x] - s;
                         se += r * r;
                         surface.row(y)[x] = static_cast<uint8_t>(std::clamp(std::lround(s), 0L, 255L));
                         flat.row(y)[x] = static_cast<uint8_t>(std::clamp(std::lround(r + coef[0]), 0L, 255L));
                     }
                 g.save("qr-surface", surface, "the fitted shading");
                 g.save("qr-flattened", flat, "grey minus the shading, plus a");
                 char line[200];
                 std::snprintf(line, sizeof line,
                               "%d x %d system; a %.1f, b %.1f, c %.1f, d %.1f, e %.1f, f %.1f; residual RMS %.1f", rows,
                               kTerms, coef[0], coef[1], coef[2], coef[3], coef[4], coef[5],
                               std::sqrt(se / (double(grey.width) * grey.height)));
                 g.note(line);
             });

}  // namespace
}  // namespace ztool
