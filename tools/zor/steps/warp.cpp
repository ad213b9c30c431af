// Demo step of the warps: an affine shear and a perspective tilt.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

ZT_DEMO_STEP(17, "warp", "Affine and perspective warps",
             "An affine warp (shear with a slight scale) and a perspective warp that maps the image onto a "
             "trapezoid, as if tilted back; pixels that map outside the source stay white.",
             "zoriWarpAffine_8u_C3R, zoriGetPerspectiveTransform, zoriWarpPerspective_8u_C3R", [](Gallery& g) {
                 const Image& p = g.photo();
                 const ImageRect all{0, 0, p.width, p.height};
                 Image affine(p.width, p.height, 3, 255), persp(p.width, p.height, 3, 255);
                 double shear[2][3] = {{0.9, 0.25, 0.0}, {0.0, 0.9, 15.0}};
                 ZT_CALL(zoriWarpAffine_8u_C3R(p.px.data(), p.size(), p.step(), all, affine.px.data(), affine.step(),
                                               all, shear, InterLinear));
                 const double w = p.width - 1, h = p.height - 1;
                 double quad[4][2] = {{0.2 * w, 0.1 * h}, {0.8 * w, 0.1 * h}, {w, h}, {0, h}};
                 double coeffs[3][3];
                 ZT_CALL(zoriGetPerspectiveTransform(all, quad, coeffs));
                 ZT_CALL(zoriWarpPerspective_8u_C3R(p.px.data(), p.size(), p.step(), all, persp.px.data(), persp.step(),
                                                    all, coeffs, InterLinear));
                 g.save("warp-affine", affine, "x' = 0.9 x + 0.25 y, y' = 0.9 y + 15");
                 g.save("warp-perspective", persp, "corners to a trapezoid");
             });

}  // namespace
}  // namespace ztool
