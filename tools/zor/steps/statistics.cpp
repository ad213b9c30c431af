// Demo step of the image statistics and moments: per-channel numbers, and
// the centroid and main axis of the grey image drawn over it.
#include <cmath>
#include <cstdio>
#include <type_traits>

#include "tools/zor/demo.h"

namespace ztool {
namespace {

// The type of an export's first parameter (the moment state's pointer type).
template <class R, class A, class... B>
A firstParameter(R(ZOR_CALL*)(A, B...));

ZT_DEMO_STEP(46, "statistics", "Statistics and moments",
             "Mean, standard deviation, minimum and maximum of each channel, and the centroid and main axis of the "
             "grey image from its spatial moments (brightness as mass), drawn in red.",
             "zoriMean_StdDev_8u_C3CR, zoriMinMax_8u_C3R, zoriMoments64f_32f_C1R, zoriGetSpatialMoment_64f",
             [](Gallery& g) {
                 const Image& p = g.photo();
                 std::string stats;
                 uint8_t lo[3], hi[3];
                 ZT_CALL(zoriMinMax_8u_C3R(p.px.data(), p.step(), p.size(), lo, hi));
                 for (int coi = 1; coi <= 3; ++coi) {
                     double mean = 0, dev = 0;
                     ZT_CALL(zoriMean_StdDev_8u_C3CR(p.px.data(), p.step(), p.size(), coi, &mean, &dev));
                     char line[96];
                     std::snprintf(line, sizeof line, "%s%s: mean %.2f, deviation %.2f, range %d..%d",
                                   coi > 1 ? "; " : "",
                                   coi == 1   ? "red"
                                   : coi == 2 ? "green"
                                              : "blue",
                                   mean, dev, lo[coi - 1], hi[coi - 1]);
                     stats += line;
                 }
                 g.note(stats);

                 const Image& grey = g.grey();
                 std::vector<float> f(grey.px.begin(), grey.px.end());
                 std::remove_pointer_t<decltype(firstParameter(&zoriMomentInitAlloc_64f))> state = nullptr;
                 ZT_CALL(zoriMomentInitAlloc_64f(&state, 0));
                 double m[4][4] = {};
                 Status s = zoriMoments64f_32f_C1R(f.data(), 4 * grey.width, grey.size(), state);
                 for (int i = 0; i <= 2 && s >= 0; ++i)
                     for (int j = 0; i + j <= 2 && s >= 0; ++j)
                         s = zoriGetSpatialMoment_64f(state, i, j, 0, ImagePoint{0, 0}, &m[i][j]);
                 zoriMomentFree_64f(state);
                 ZT_CALL(s);
                 const double cx = m[1][0] / m[0][0], cy = m[0][1] / m[0][0];
                 const double mu20 = m[2][0] / m[0][0] - cx * cx, mu02 = m[0][2] / m[0][0] - cy * cy,
                              mu11 = m[1][1] / m[0][0] - cx * cy;
                 const double angle = 0.5 * std::atan2(2 * mu11, mu20 - mu02);
                 Image out = g.photo();
                 auto dot = [&](double x, double y) {
                     const int xi = static_cast<int>(std::lround(x)), yi = static_cast<int>(std::lround(y));
                     if (xi < 0 || yi < 0 || xi >= out.width || yi >= out.height) return;
                     uint8_t* q = out.row(yi) + 3 * xi;
                     q[0] = 230, q[1] = 20, q[2] = 20;
                 };
                 for (int t = -120; t <= 120; ++t)
                     for (int w = -1; w <= 1; ++w)
                         dot(cx + t * std::cos(angle) - w * std::sin(angle),
                             cy + t * std::sin(angle) + w * std::cos(angle));
                 for (int t = -8; t <= 8; ++t)
                     for (int w = -1; w <= 1; ++w) dot(cx + t, cy + w), dot(cx + w, cy + t);
                 char line[96];
                 std::snprintf(line, sizeof line, "centroid (%.1f, %.1f), main axis %.1f degrees", cx, cy,
                               angle * 180 / 3.141592653589793);
                 g.save("moments", out, line);
             });

}  // namespace
}  // namespace ztool
