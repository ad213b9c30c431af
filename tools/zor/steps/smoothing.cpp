// Demo step of the smoothing filters.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

ZT_DEMO_STEP(62, "smoothing", "Smoothing filters",
             "The fixed 5x5 Gaussian ([1 4 6 4 1] both ways, / 256) and a 9x9 box mean, over a replicated border.",
             "zoriFilterGauss_8u_C3R, zoriFilterBox_8u_C3R", [](Gallery& g) {
                 const Image& p = g.photo();
                 const Image pad2 = padReplicate(p, 2), pad4 = padReplicate(p, 4);
                 Image gauss(p.width, p.height, 3), box(p.width, p.height, 3);
                 ZT_CALL(zoriFilterGauss_8u_C3R(pad2.px.data() + 2 * pad2.step() + 6, pad2.step(), gauss.px.data(),
                                                gauss.step(), p.size(), MaskSize5x5));
                 ZT_CALL(zoriFilterBox_8u_C3R(pad4.px.data() + 4 * pad4.step() + 12, pad4.step(), box.px.data(),
                                              box.step(), p.size(), ImageSize{9, 9}, ImagePoint{4, 4}));
                 g.save("smooth-gauss5", gauss, "Gauss 5x5");
                 g.save("smooth-box9", box, "box 9x9");
             });

}  // namespace
}  // namespace ztool
