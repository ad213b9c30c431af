// Demo step of the JPEG primitives: the 8x8 DCT quantisation round trip of
// the grey image at several qualities, with the PSNR of each.
#include <algorithm>
#include <cstdio>

#include "tools/zor/demo.h"

namespace ztool {
namespace {

// The example luminance table of the JPEG standard (Annex K), natural order.
const int kLuma[64] = {16, 11,  10,  16, 24, 40, 51, 61, 12,  12,  14,  19,  26, 58, 60, 55,  14,  13,  16,  24, 40, 57,
                       69, 56,  14,  17, 22, 29, 51, 87, 80,  62,  18,  22,  37, 56, 68, 109, 103, 77,  24,  35, 55, 64,
                       81, 104, 113, 92, 49, 64, 78, 87, 103, 121, 120, 101, 72, 92, 95, 98,  112, 100, 103, 99};
// Natural index of each zigzag position.
const int kZigzag[64] = {0,  1,  8,  16, 9,  2,  3,  10, 17, 24, 32, 25, 18, 11, 4,  5,  12, 19, 26, 33, 40, 48,
                         41, 34, 27, 20, 13, 6,  7,  14, 21, 28, 35, 42, 49, 56, 57, 50, 43, 36, 29, 22, 15, 23,
                         30, 37, 44, 51, 58, 59, 52, 45, 38, 31, 39, 46, 53, 60, 61, 54, 47, 55, 62, 63};

ZT_DEMO_STEP(26, "jpeg", "8x8 DCT quantisation round trip",
             "Each 8x8 block of the grey image through the forward DCT with quantisation and back (the JPEG "
             "luminance table scaled for quality 10, 30, 60 and 90): blocking at low quality, and the PSNR rising "
             "with the quality.",
             "zoriQuantFwdTableInit_JPEG_8u16u, zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R, "
             "zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R",
             [](Gallery& g) {
                 const Image& grey = g.grey();
                 const int w = grey.width / 8 * 8, h = grey.height / 8 * 8;
                 Image src(w, h, 1);
                 ZT_CALL(zoriCopy_8u_C1R(grey.px.data(), grey.step(), src.px.data(), src.step(), src.size()));
                 std::string psnrs;
                 for (int quality : {10, 30, 60, 90}) {
                     // The usual quality scaling of the table.
                     const int scale = quality < 50 ? 5000 / quality : 200 - 2 * quality;
                     uint8_t raw[64];
                     uint16_t fwd[64], inv[64];
                     for (int z = 0; z < 64; ++z) {
                         const int q = std::min(255, std::max(1, (kLuma[kZigzag[z]] * scale + 50) / 100));
                         raw[z] = static_cast<uint8_t>(q);
                         inv[kZigzag[z]] = static_cast<uint16_t>(q);
                     }
                     ZT_CALL(zoriQuantFwdTableInit_JPEG_8u16u(raw, fwd));
                     Image back(w, h, 1);
                     int16_t coeffs[64];
                     for (int by = 0; by < h; by += 8)
                         for (int bx = 0; bx < w; bx += 8) {
                             ZT_CALL(zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(src.row(by) + bx, src.step(), coeffs, fwd));
                             ZT_CALL(zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R(coeffs, back.row(by) + bx, back.step(), inv));
                         }
                     char line[64];
                     std::snprintf(line, sizeof line, "quality %d: PSNR %.2f dB", quality, psnr(src, back));
                     psnrs += (psnrs.empty() ? "" : "; ") + std::string(line);
                     g.save("jpeg-q" + std::to_string(quality), back, line);
                 }
                 g.note(psnrs);
             });

}  // namespace
}  // namespace ztool
