// Fixed-size entry points kept for older callers: 3 x 3 Sobel derivatives
// and 3 x 3 QR.  Compiled once per variant like a family; each adapter
// calls the same variant's entry of the general function (ZOR_NS::name,
// qualified so that lookup by the ImageSize argument cannot find the
// export), checks nothing itself and returns its status unchanged.
#include "frame/variant.h"

namespace zor { namespace ZOR_NS {

// Dx is the vertical-edge filter, Dy the horizontal-edge one.
Status ZOR_CALL zoriSobel3x3_Dx_8u16s_C1R(const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                          ImageSize roiSize) {
    return ZOR_NS::zoriFilterSobelVert_8u16s_C1R(pSrc, srcStep, pDst, dstStep, roiSize, MaskSize3x3);
}

// The Dy forms take one argument word more than the Dx forms; it is ignored.
Status ZOR_CALL zoriSobel3x3_Dy_8u16s_C1R(const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                          int /*reserved*/, ImageSize roiSize) {
    return ZOR_NS::zoriFilterSobelHoriz_8u16s_C1R(pSrc, srcStep, pDst, dstStep, roiSize, MaskSize3x3);
}

Status ZOR_CALL zoriSobel3x3_Dx_32f_C1R(const float* pSrc, int srcStep, float* pDst, int dstStep,
                                        ImageSize roiSize) {
    return ZOR_NS::zoriFilterSobelVertMask_32f_C1R(pSrc, srcStep, pDst, dstStep, roiSize, MaskSize3x3);
}

Status ZOR_CALL zoriSobel3x3_Dy_32f_C1R(const float* pSrc, int srcStep, float* pDst, int dstStep,
                                        int /*reserved*/, ImageSize roiSize) {
    return ZOR_NS::zoriFilterSobelHorizMask_32f_C1R(pSrc, srcStep, pDst, dstStep, roiSize, MaskSize3x3);
}

// 3 x 3 matrices of densely packed doubles: element stride 8 bytes.
constexpr int kDense = sizeof(double);

Status ZOR_CALL zormQRDecomp_m_64f_3x3(const double* pSrc, int srcStride1, double* pBuffer, double* pDst,
                                       int dstStride1) {
    return ZOR_NS::zormQRDecomp_m_64f(pSrc, srcStride1, kDense, pBuffer, pDst, dstStride1, kDense, 3, 3);
}

Status ZOR_CALL zormQRBackSubst_mv_64f_3x3(const double* pSrc, int srcStride1, double* pBuffer,
                                           const double* pSrc2, double* pDst) {
    return ZOR_NS::zormQRBackSubst_mv_64f(pSrc, srcStride1, kDense, pBuffer, pSrc2, kDense, pDst, kDense, 3, 3);
}

}}  // namespace zor::ZOR_NS
