// Demo step of the rotation family: the photograph turned about its centre.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

ZT_DEMO_STEP(16, "rotate", "Rotation",
             "The photograph turned by 30 degrees about its centre (the shift from zoriGetRotateShift), bilinear; "
             "destination pixels that map outside the source stay as they were (white).",
             "zoriGetRotateShift, zoriRotate_8u_C3R", [](Gallery& g) {
                 const Image& p = g.photo();
                 Image out(p.width, p.height, 3, 255);
                 double xs = 0, ys = 0;
                 ZT_CALL(zoriGetRotateShift((p.width - 1) / 2.0, (p.height - 1) / 2.0, 30.0, &xs, &ys));
                 const ImageRect all{0, 0, p.width, p.height};
                 ZT_CALL(zoriRotate_8u_C3R(p.px.data(), p.size(), p.step(), all, out.px.data(), out.step(), all, 30.0,
                                           xs, ys, InterLinear));
                 g.save("rotate-30", out, "30 degrees about the centre, linear");
             });

}  // namespace
}  // namespace ztool
