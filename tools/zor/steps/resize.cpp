// Demo step of the resize family: one crop enlarged by each interpolation,
// and the whole photograph shrunk by area averaging.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

Image resize(const Image& src, ImageRect roi, int w, int h, int interpolation) {
    Image out(w, h, 3);
    ZT_CALL(zoriResize_8u_C3R(src.px.data(), src.size(), src.step(), roi, out.px.data(), out.step(), out.size(),
                              double(w) / roi.width, double(h) / roi.height, interpolation));
    return out;
}

ZT_DEMO_STEP(
    15, "resize", "Resize per interpolation",
    "A 56 x 40 crop around the left eye enlarged 5 times by each interpolation (nearest, linear, cubic, "
    "Lanczos), and the whole photograph shrunk to a third by super-sampling (area average).",
    "zoriResize_8u_C3R", [](Gallery& g) {
        const Image& p = g.photo();
        const ImageRect eye{120, 90, 56, 40};
        const struct {
            int mode;
            const char* name;
        } modes[] = {{InterNearest, "nearest"}, {InterLinear, "linear"}, {InterCubic, "cubic"}, {16, "lanczos"}};
        for (const auto& m : modes)
            g.save(std::string("resize-") + m.name, resize(p, eye, 5 * eye.width, 5 * eye.height, m.mode),
                   std::string(m.name) + ", x5");
        const ImageRect all{0, 0, p.width, p.height};
        g.save("resize-super", resize(p, all, p.width / 3, p.height / 3, InterSuper), "super-sampling to 1/3");
    });

}  // namespace
}  // namespace ztool
