/*
 * The list of every exported function: one ZOR_FN row per export.
 *
 *   ZOR_FN(map, result type, name, (parameters))
 *
 * The including file defines ZOR_FN.  From these rows come the declarations
 * in zor.h, the export stubs, the dispatch table and the Windows .def file;
 * no other list of exports is kept anywhere.
 *
 * map names the code variant whose entry fills each of the five dispatch
 * columns (generic, SSE, SSE2, SSE3, SSSE3):
 *   ZOR_ALL      each variant has its own entry
 *   ZOR_GENERIC  the generic entry serves every processor
 *   ZOR_SSE2UP   generic entry for the generic and SSE columns
 *
 * No include guard: the file is included once per expansion.
 */

/* ---- frame: aligned allocation and version records ---------------- */

ZOR_FN(ZOR_GENERIC, uint8_t*,    zorsMalloc_8u,   (int len))
ZOR_FN(ZOR_GENERIC, int8_t*,     zorsMalloc_8s,   (int len))
ZOR_FN(ZOR_GENERIC, uint16_t*,   zorsMalloc_16u,  (int len))
ZOR_FN(ZOR_GENERIC, int16_t*,    zorsMalloc_16s,  (int len))
ZOR_FN(ZOR_GENERIC, Complex8s*,  zorsMalloc_8sc,  (int len))
ZOR_FN(ZOR_GENERIC, uint32_t*,   zorsMalloc_32u,  (int len))
ZOR_FN(ZOR_GENERIC, int32_t*,    zorsMalloc_32s,  (int len))
ZOR_FN(ZOR_GENERIC, float*,      zorsMalloc_32f,  (int len))
ZOR_FN(ZOR_GENERIC, Complex16s*, zorsMalloc_16sc, (int len))
ZOR_FN(ZOR_GENERIC, int64_t*,    zorsMalloc_64s,  (int len))
ZOR_FN(ZOR_GENERIC, double*,     zorsMalloc_64f,  (int len))
ZOR_FN(ZOR_GENERIC, Complex32s*, zorsMalloc_32sc, (int len))
ZOR_FN(ZOR_GENERIC, Complex32f*, zorsMalloc_32fc, (int len))
ZOR_FN(ZOR_GENERIC, Complex64s*, zorsMalloc_64sc, (int len))
ZOR_FN(ZOR_GENERIC, Complex64f*, zorsMalloc_64fc, (int len))
ZOR_FN(ZOR_GENERIC, void,        zorsFree,        (void* ptr))

ZOR_FN(ZOR_GENERIC, uint8_t*,  zoriMalloc_8u_C1,  (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, uint16_t*, zoriMalloc_16u_C1, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, int16_t*,  zoriMalloc_16s_C1, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, float*,    zoriMalloc_32f_C1, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, uint8_t*,  zoriMalloc_8u_C4,  (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, uint16_t*, zoriMalloc_16u_C3, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, int16_t*,  zoriMalloc_16s_C3, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, uint8_t*,  zoriMalloc_8u_C3,  (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, float*,    zoriMalloc_32f_C3, (int width, int height, int* pStep))
ZOR_FN(ZOR_GENERIC, void,      zoriFree,          (void* ptr))

ZOR_FN(ZOR_ALL, const LibraryVersion*, zorsGetLibVersion, (void))
ZOR_FN(ZOR_ALL, const LibraryVersion*, zoriGetLibVersion, (void))

/* ---- image/pixel/copy ---- */

ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C1R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_32f_C1R,
       (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C3R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_32f_C3R,
       (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C4R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C3MR,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
        const uint8_t* pMask, int maskStep))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C3C1R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C4C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C4C1R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C1C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C1C3R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C1C4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C1C4R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C3AC4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C3AC4R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_AC4C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_AC4C3R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C3P3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C3P3R,
       (const int16_t* pSrc, int srcStep, int16_t* const pDst[3], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C4P4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[4], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C4P4R,
       (const int16_t* pSrc, int srcStep, int16_t* const pDst[4], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_P3C3R,
       (const uint8_t* const pSrc[3], int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_P3C3R,
       (const int16_t* const pSrc[3], int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_P4C4R,
       (const uint8_t* const pSrc[4], int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriDup_8u_C1C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_8u_C1R,  (uint8_t value, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_16s_C1R, (int16_t value, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_32s_C1R, (int32_t value, int32_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_32f_C1R, (float value, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_8u_C3R,
       (const uint8_t value[3], uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_16s_C3R,
       (const int16_t value[3], int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_8u_C3MR,
       (const uint8_t value[3], uint8_t* pDst, int dstStep, ImageSize roiSize,
        const uint8_t* pMask, int maskStep))
ZOR_FN(ZOR_SSE2UP, Status, zoriSwapChannels_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriSwapChannels_16u_C3R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriSwapChannels_8u_AC4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriSwapChannels_16u_AC4R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriSwapChannels_8u_C3IR,
       (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopyReplicateBorder_8u_C1R,
       (const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize, uint8_t* pDst, int dstStep,
        ImageSize dstRoiSize, int topBorderHeight, int leftBorderWidth))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopyReplicateBorder_8u_C3R,
       (const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize, uint8_t* pDst, int dstStep,
        ImageSize dstRoiSize, int topBorderHeight, int leftBorderWidth))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopyReplicateBorder_16s_C1R,
       (const int16_t* pSrc, int srcStep, ImageSize srcRoiSize, int16_t* pDst, int dstStep,
        ImageSize dstRoiSize, int topBorderHeight, int leftBorderWidth))

/* ---- image/pixel/convert ---- */

ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_8u16u_C1R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_8u16u_C3R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_8u16u_C4R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_8u32f_C1R,
       (const uint8_t* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_16s32f_C1R,
       (const int16_t* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvert_32f8u_C1R,
       (const float* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, int roundMode))
ZOR_FN(ZOR_SSE2UP, Status, zoriLShiftC_16u_C1IR,
       (uint32_t value, uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriLShiftC_16u_C3IR,
       (const uint32_t value[3], uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriLShiftC_16u_AC4IR,
       (const uint32_t value[3], uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize))

/* ---- image/geometry/mirror ---- */

ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_32s_C3R,
       (const int32_t* pSrc, int srcStep, int32_t* pDst, int dstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_8u_C1IR,   (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_8u_C3IR,   (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_8u_AC4IR,  (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_16u_C1IR,  (uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_16u_C3IR,  (uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))
ZOR_FN(ZOR_SSE2UP, Status, zoriMirror_16u_AC4IR, (uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize, int flip))

/* ---- image/filter/linear ----
 * True convolution with the flipped kernel; the anchor is not validated.
 * Integer divisor: 1 = no scaling; 2^k = (sum + 2^(k-1)) >> k; any other
 * value multiplies by (float)(1.0/divisor), exactly, rounding half up; every
 * non-positive quotient gives 0.  The divisor -2147483648 (which has no shift
 * count) is treated like any other non-power-of-two divisor: the result is
 * round-half-up(sum * -2^-31), i.e. 1 for sums <= -2^30 and 0 otherwise. */
ZOR_FN(ZOR_ALL, Status, zoriFilter_8u_C1R,    (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_ALL, Status, zoriFilter_8u_C3R,    (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_ALL, Status, zoriFilter_16s_C1R,   (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_ALL, Status, zoriFilter32f_8u_C1R, (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriFilter32f_8u_C3R, (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriFilter32f_16s_C1R,(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))

/* ---- image/filter/sobel ----
 * Border types of the ...Border_ forms.  Only the ROI is read; the pixels
 * outside it are synthesised in the work buffer:
 *   0  replicate:           a a a | a b c ... x y z | z z z
 *   1  constant:            v v v | a b c ... x y z | v v v   (v = borderValue)
 *   2  mirror, edge not repeated:  d c b | a b c d ... (a 1-pixel side replicates)
 *   3  mirror, edge repeated:      c b a | a b c ...
 *   4  wrap:                x y z | a b c ... x y z | a b c
 * borderValue is used by type 1 only.  Any other type: StatusBadArgument. */
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHoriz_8u_C1R,      (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHoriz_32f_C1R,     (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVert_32f_C1R,      (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHorizMask_32f_C1R, (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVertMask_32f_C1R,  (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHoriz_8u16s_C1R,   (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVert_8u16s_C1R,    (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHorizBorder_8u16s_C1R, (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, uint8_t borderValue, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVertBorder_8u16s_C1R,  (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, uint8_t borderValue, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHorizBorder_32f_C1R,   (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, float borderValue, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVertBorder_32f_C1R,    (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, float borderValue, uint8_t* pBuffer))
ZOR_FN(ZOR_GENERIC, Status, zoriFilterSobelHorizGetBufferSize_8u16s_C1R, (ImageSize roiSize, int mask, int* pBufferSize))
ZOR_FN(ZOR_GENERIC, Status, zoriFilterSobelVertGetBufferSize_8u16s_C1R,  (ImageSize roiSize, int mask, int* pBufferSize))
ZOR_FN(ZOR_GENERIC, Status, zoriFilterSobelHorizGetBufferSize_32f_C1R,   (ImageSize roiSize, int mask, int* pBufferSize))
ZOR_FN(ZOR_GENERIC, Status, zoriFilterSobelVertGetBufferSize_32f_C1R,    (ImageSize roiSize, int mask, int* pBufferSize))

/* ---- image/filter/rank ---- */
ZOR_FN(ZOR_ALL, Status, zoriFilterMedian_8u_C1R,  (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriFilterMedian_16s_C1R, (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriFilterMax_8u_C1R,     (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriFilterMin_8u_C1R,     (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor))

/* ---- image/filter/morphology ---- */
ZOR_FN(ZOR_ALL, Status, zoriDilate3x3_8u_C1IR,  (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriErode3x3_8u_C1IR,   (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriErode3x3_32f_C1IR,  (float* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriDilate_8u_C1IR,     (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, const uint8_t* pMask, ImageSize maskSize, ImagePoint anchor))
ZOR_FN(ZOR_ALL, Status, zoriErode_8u_C1IR,      (uint8_t* pSrcDst, int srcDstStep, ImageSize roiSize, const uint8_t* pMask, ImageSize maskSize, ImagePoint anchor))

/* ---- image/filter/canny ---- */
ZOR_FN(ZOR_GENERIC, Status, zoriCannyGetSize,   (ImageSize roiSize, int* pBufferSize))
ZOR_FN(ZOR_ALL, Status, zoriCanny_16s8u_C1R,    (const int16_t* pSrcDx, int srcDxStep, const int16_t* pSrcDy, int srcDyStep, uint8_t* pDstEdges, int dstEdgeStep, ImageSize roiSize, float lowThreshold, float highThreshold, uint8_t* pBuffer))
