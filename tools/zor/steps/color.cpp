// Demo step of the colour conversions: YCbCr planes, hue alone, a hue turn.
#include "tools/zor/demo.h"

namespace ztool {
namespace {

Image plane(const Image& img, int c) {
    Image out(img.width, img.height, 1);
    ZT_CALL(zoriCopy_8u_C3C1R(img.px.data() + c, img.step(), out.px.data(), out.step(), img.size()));
    return out;
}

ZT_DEMO_STEP(25, "color", "Colour spaces",
             "The photograph in YCbCr (luma and the two chroma planes, fixed point), its hue alone (HSV with full "
             "saturation and value, converted back) and its hues turned by a third of the circle.",
             "zoriRGBToYCbCr_8u_C3R, zoriRGBToHSV_8u_C3R, zoriHSVToRGB_8u_C3R, zoriCopy_8u_C3C1R", [](Gallery& g) {
                 const Image& p = g.photo();
                 Image ycc(p.width, p.height, 3), hsv(p.width, p.height, 3);
                 ZT_CALL(zoriRGBToYCbCr_8u_C3R(p.px.data(), p.step(), ycc.px.data(), ycc.step(), p.size()));
                 ZT_CALL(zoriRGBToHSV_8u_C3R(p.px.data(), p.step(), hsv.px.data(), hsv.step(), p.size()));
                 Image hueOnly = hsv, turned = hsv, a(p.width, p.height, 3), b(p.width, p.height, 3);
                 for (size_t i = 0; i < hsv.px.size(); i += 3) {
                     hueOnly.px[i + 1] = hueOnly.px[i + 2] = 255;
                     turned.px[i] = static_cast<uint8_t>((hsv.px[i] + 85) % 255);
                 }
                 ZT_CALL(zoriHSVToRGB_8u_C3R(hueOnly.px.data(), hueOnly.step(), a.px.data(), a.step(), p.size()));
                 ZT_CALL(zoriHSVToRGB_8u_C3R(turned.px.data(), turned.step(), b.px.data(), b.step(), p.size()));
                 g.save("color-y", plane(ycc, 0), "Y (16..235)");
                 g.save("color-cb", plane(ycc, 1), "Cb");
                 g.save("color-cr", plane(ycc, 2), "Cr");
                 g.save("color-hue", a, "hue alone");
                 g.save("color-hue-turned", b, "hue + 120 degrees");
             });

}  // namespace
}  // namespace ztool
