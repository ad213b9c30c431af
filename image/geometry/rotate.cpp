// Rotation of an image ROI by an angle in degrees, and the helpers for the
// shift that keeps a centre fixed and for the bounding box of the result.
// A rotation is the affine warp (warp.cpp) of
//   x' = x c + y s + xShift,  y' = -x s + y c + yShift;
// the rules are listed with the rows in the manifest.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/status.h"
#include "image/geometry/warp_kernels.h"

#include <algorithm>
#include <cmath>

#if ZOR_VARIANT != 1

namespace zor { namespace ZOR_NS {
namespace {

struct Turn {
    double c, s;  // cosine and sine
    double a;     // the angle reduced to [0, 360)
};

// The reduced angle and its cosine and sine, exact at the right angles.  The
// same bits in every variant: double arithmetic at 53 bits, the library
// results rounded to double before use.
Turn turnOf(double angle) {
    Turn t;
    {
        DoublePrecisionScope precision;
        t.a = toDouble(angle - 360 * std::trunc(angle / 360));
        if (t.a < 0) t.a = toDouble(t.a + 360);
    }
    if (t.a == 0) t.c = 1, t.s = 0;
    else if (t.a == 90) t.c = 0, t.s = 1;
    else if (t.a == 180) t.c = -1, t.s = 0;
    else if (t.a == 270) t.c = 0, t.s = -1;
    else {
        double r;
        {
            DoublePrecisionScope precision;
            r = toDouble(t.a / 180 * 3.141592653589793);
        }
        t.c = toDouble(std::cos(r));
        t.s = toDouble(std::sin(r));
    }
    return t;
}

// The shifts that keep (xc, yc) fixed.
void shiftsFor(double xc, double yc, double angle, double& xShift, double& yShift) {
    const Turn t = turnOf(angle);
    DoublePrecisionScope precision;
    if (t.a == 0) xShift = 0, yShift = 0;
    else if (t.a == 90) xShift = xc - yc, yShift = xc + yc;
    else if (t.a == 180) xShift = 2 * xc, yShift = 2 * yc;
    else if (t.a == 270) xShift = xc + yc, yShift = yc - xc;
    else xShift = toDouble(xc - xc * t.c - yc * t.s), yShift = toDouble(yc - t.c * yc + t.s * xc);
}

// The rotation as affine coefficients.
void rotationCoeffs(double angle, double xShift, double yShift, double coeffs[2][3]) {
    const Turn t = turnOf(angle);
    coeffs[0][0] = t.c, coeffs[0][1] = t.s, coeffs[0][2] = xShift;
    coeffs[1][0] = -t.s, coeffs[1][1] = t.c, coeffs[1][2] = yShift;
}

Status rotate(WarpPixels pixels, const void* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, void* pDst,
              int dstStep, ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation) {
    double coeffs[2][3];
    rotationCoeffs(angle, xShift, yShift, coeffs);
    return warpAffineImage(pixels, pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

#define ZOR_ROTATE(name, T, pixels)                                                                           \
    Status ZOR_CALL name(const T* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, T* pDst, int dstStep,    \
                         ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation) {      \
        return rotate(WarpPixels::pixels, pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, angle, xShift, \
                      yShift, interpolation);                                                                   \
    }
ZOR_ROTATE(zoriRotate_8u_C1R, uint8_t, u8C1)
ZOR_ROTATE(zoriRotate_8u_C3R, uint8_t, u8C3)
ZOR_ROTATE(zoriRotate_16u_C1R, uint16_t, u16C1)
ZOR_ROTATE(zoriRotate_16u_C3R, uint16_t, u16C3)
ZOR_ROTATE(zoriRotate_32f_C3R, float, f32C3)
#undef ZOR_ROTATE

Status ZOR_CALL zoriRotateCenter_8u_C3R(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                                        uint8_t* pDst, int dstStep, ImageRect dstRoi, double angle, double xCenter,
                                        double yCenter, int interpolation) {
    double xShift, yShift;
    shiftsFor(xCenter, yCenter, angle, xShift, yShift);
    return rotate(WarpPixels::u8C3, pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, angle, xShift, yShift,
                  interpolation);
}

#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

Status ZOR_CALL zoriGetRotateShift(double xCenter, double yCenter, double angle, double* pxShift, double* pyShift) {
    if (Status s = anyNull(pxShift, pyShift)) return s;
    shiftsFor(xCenter, yCenter, angle, *pxShift, *pyShift);
    return StatusOk;
}

Status ZOR_CALL zoriAddRotateShift(double xCenter, double yCenter, double angle, double* pxShift, double* pyShift) {
    if (Status s = anyNull(pxShift, pyShift)) return s;
    double x, y;
    shiftsFor(xCenter, yCenter, angle, x, y);
    DoublePrecisionScope precision;
    *pxShift = *pxShift + x;
    *pyShift = *pyShift + y;
    return StatusOk;
}

Status ZOR_CALL zoriGetRotateBound(ImageRect srcRoi, double bound[2][2], double angle, double xShift,
                                   double yShift) {
    if (Status s = checkFirst(anyNull(bound), badRoi(ImageSize{srcRoi.width, srcRoi.height}))) return s;
    if (!std::isfinite(angle) || !std::isfinite(xShift) || !std::isfinite(yShift)) return StatusBadArgument;
    double coeffs[2][3];
    rotationCoeffs(angle, xShift, yShift, coeffs);
    return ZOR_NS::zoriGetAffineBound(srcRoi, bound, coeffs);
}

#endif

}}  // namespace zor::ZOR_NS

#endif
