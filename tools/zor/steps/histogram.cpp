// Demo step of the histograms: the three channels of the photograph plotted.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

ZT_DEMO_STEP(45, "histogram", "Histograms",
             "Histograms of the red, green and blue channels of the photograph in 64 bins of width 4 (levels 0, 4, "
             "... 256), drawn as lines.",
             "zoriHistogramRange_8u_C3R", [](Gallery& g) {
                 const Image& p = g.photo();
                 int32_t levels[65];
                 for (int k = 0; k <= 64; ++k) levels[k] = 4 * k;
                 int32_t counts[3][64];
                 int32_t* hist[3] = {counts[0], counts[1], counts[2]};
                 const int32_t* lv[3] = {levels, levels, levels};
                 int n[3] = {65, 65, 65};
                 ZT_CALL(zoriHistogramRange_8u_C3R(p.px.data(), p.step(), p.size(), hist, lv, n));
                 std::vector<std::vector<double>> series(3, std::vector<double>(64));
                 for (int c = 0; c < 3; ++c)
                     for (int k = 0; k < 64; ++k) series[c][k] = counts[c][k];
                 g.save("histogram", plotSeries(series, 512, 200), "red, green, blue; value 0 at the left");
             });

}  // namespace
}  // namespace ztool
