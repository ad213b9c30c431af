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

/* ---- signal/vector/init ---- */

ZOR_FN(ZOR_GENERIC, Status, zorsZero_8u,   (uint8_t* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_16s,  (int16_t* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_16sc, (Complex16s* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_32f,  (float* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_32fc, (Complex32f* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_64f,  (double* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsZero_64fc, (Complex64f* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_8u,   (uint8_t val, uint8_t* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_16s,  (int16_t val, int16_t* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_32s,  (int32_t val, int32_t* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_64s,  (int64_t val, int64_t* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_32f,  (float val, float* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_64f,  (double val, double* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_16sc, (Complex16s val, Complex16s* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_32sc, (Complex32s val, Complex32s* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_32fc, (Complex32f val, Complex32f* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_64sc, (Complex64s val, Complex64s* pDst, int len))
ZOR_FN(ZOR_ALL, Status, zorsSet_64fc, (Complex64f val, Complex64f* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_8u,   (const uint8_t* pSrc, uint8_t* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_16s,  (const int16_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_16sc, (const Complex16s* pSrc, Complex16s* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_32f,  (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_32fc, (const Complex32f* pSrc, Complex32f* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_64f,  (const double* pSrc, double* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsCopy_64fc, (const Complex64f* pSrc, Complex64f* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_8s16s,  (const int8_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_16s32s, (const int16_t* pSrc, int32_t* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_8u32f,  (const uint8_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_8s32f,  (const int8_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_16s32f, (const int16_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_16u32f, (const uint16_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32s32f, (const int32_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32s64f, (const int32_t* pSrc, double* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32s16s, (const int32_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f8u_Sfs,
       (const float* pSrc, uint8_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f8s_Sfs,
       (const float* pSrc, int8_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f16u_Sfs,
       (const float* pSrc, uint16_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f16s_Sfs,
       (const float* pSrc, int16_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f32s_Sfs,
       (const float* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_64f32s_Sfs,
       (const double* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor))

/* ---- signal/vector/arith ---- */
ZOR_FN(ZOR_ALL,     Status, zorsAdd_32f,          (const float* pSrc1, const float* pSrc2, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsAdd_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSub_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsMul_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsDiv_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsAddC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSubC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSubC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsMulC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsMulC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsDivC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsDivC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAdd_16s_Sfs,      (const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAddC_16s_I,       (int16_t val, int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsSubC_16s_I,       (int16_t val, int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMul_NR_16s_Sfs,   (const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMul_NR_16s_ISfs,  (const int16_t* pSrc, int16_t* pSrcDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMulC_NR_16s_Sfs,  (const int16_t* pSrc, int16_t val, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMulC_NR_16s_ISfs, (int16_t val, int16_t* pSrcDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_16s,          (const int16_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsAbs_32f,          (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_64f,          (const double* pSrc, double* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_16s_I,        (int16_t* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsAbs_32f_I,        (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_64f_I,        (double* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSqr_32f,          (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSqr_32f_I,        (float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSqrt_32f_I,       (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsLn_32f_I,         (float* pSrcDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsThreshold_32f_I,  (float* pSrcDst, int len, float level, int relOp))
ZOR_FN(ZOR_ALL,     Status, zorsThreshold_LTVal_32f,   (const float* pSrc, float* pDst, int len, float level, float value))
ZOR_FN(ZOR_ALL,     Status, zorsThreshold_LTVal_32f_I, (float* pSrcDst, int len, float level, float value))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNormalize_32f,    (const float* pSrc, float* pDst, int len, float vSub, float vDiv))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMagnitude_32f,    (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMagnitude_32fc,   (const Complex32f* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsPhase_32f,        (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsPowerSpectr_32f,  (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAtan2_32f_A21,    (const float* pSrc1, const float* pSrc2, float* pDst, int len))
ZOR_FN(ZOR_GENERIC, Status, zorsSortDescend_32f_I, (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsDeinterleave_16s, (const int16_t* pSrc, int channels, int len, int16_t** pDst))

/* ---- signal/vector/stats ---- */
ZOR_FN(ZOR_SSE2UP,  Status, zorsSum_32f,          (const float* pSrc, int len, float* pSum, int hint))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMean_32f,         (const float* pSrc, int len, float* pMean, int hint))
ZOR_FN(ZOR_SSE2UP,  Status, zorsStdDev_32f,       (const float* pSrc, int len, float* pStdDev, int hint))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMax_16s,          (const int16_t* pSrc, int len, int16_t* pMax))
ZOR_FN(ZOR_ALL,     Status, zorsMax_32f,          (const float* pSrc, int len, float* pMax))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMax_64f,          (const double* pSrc, int len, double* pMax))
ZOR_FN(ZOR_ALL,     Status, zorsMin_32f,          (const float* pSrc, int len, float* pMin))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMaxIndx_16s,      (const int16_t* pSrc, int len, int16_t* pMax, int* pIndx))
ZOR_FN(ZOR_ALL,     Status, zorsMaxIndx_32f,      (const float* pSrc, int len, float* pMax, int* pIndx))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMaxIndx_64f,      (const double* pSrc, int len, double* pMax, int* pIndx))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNorm_L2_32f,      (const float* pSrc, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNorm_L2_16s32f,   (const int16_t* pSrc, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNormDiff_L2_32f,  (const float* pSrc1, const float* pSrc2, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNorm_L1_16s32s_Sfs, (const int16_t* pSrc, int len, int32_t* pNorm, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsDotProd_32f,      (const float* pSrc1, const float* pSrc2, int len, float* pDp))
ZOR_FN(ZOR_SSE2UP,  Status, zorsDotProd_16s32s_Sfs, (const int16_t* pSrc1, const int16_t* pSrc2, int len, int32_t* pDp, int scaleFactor))

/* ---- signal/transform/window ---- */

ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16s,    (const int16_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16s_I,  (int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16sc,   (const Complex16s* pSrc, Complex16s* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16sc_I, (Complex16s* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_32f,    (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_32f_I,  (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_32fc,   (const Complex32f* pSrc, Complex32f* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_32fc_I, (Complex32f* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64f,    (const double* pSrc, double* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64f_I,  (double* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64fc,   (const Complex64f* pSrc, Complex64f* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64fc_I, (Complex64f* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHann_32f_I,     (float* pSrcDst, int len))

/* ---- signal/transform/fft ---- */

ZOR_FN(ZOR_ALL, Status, zorsFFTInitAlloc_C_32f, (void** ppSpec, int order, int flag, int hint))
ZOR_FN(ZOR_ALL, Status, zorsFFTInitAlloc_R_32f, (void** ppSpec, int order, int flag, int hint))
ZOR_FN(ZOR_ALL, Status, zorsFFTFree_C_32f, (void* pSpec))
ZOR_FN(ZOR_ALL, Status, zorsFFTFree_R_32f, (void* pSpec))
ZOR_FN(ZOR_ALL, Status, zorsFFTFwd_CToC_32f,
       (const float* pSrcRe, const float* pSrcIm, float* pDstRe, float* pDstIm,
        const void* pSpec, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zorsFFTInv_CToC_32f,
       (const float* pSrcRe, const float* pSrcIm, float* pDstRe, float* pDstIm,
        const void* pSpec, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zorsFFTFwd_RToCCS_32f,
       (const float* pSrc, float* pDst, const void* pSpec, uint8_t* pBuffer))

/* ---- signal/transform/iir ---- */

ZOR_FN(ZOR_ALL, Status, zorsIIRInitAlloc_32f,
       (void** ppState, const float* pTaps, int order, const float* pDlyLine))
ZOR_FN(ZOR_ALL, Status, zorsIIR_32f, (const float* pSrc, float* pDst, int len, void* pState))
ZOR_FN(ZOR_ALL, Status, zorsIIRFree_32f, (void* pState))

/* ---- signal/transform/randgauss ---- */

ZOR_FN(ZOR_ALL, Status, zorsRandGaussInitAlloc_32f,
       (void** ppState, float mean, float stdDev, uint32_t seed))
ZOR_FN(ZOR_ALL, Status, zorsRandGauss_32f, (float* pDst, int len, void* pState))
ZOR_FN(ZOR_ALL, Status, zorsRandGaussFree_32f, (void* pState))

/* ---- signal/transform/autocorr ---- */

ZOR_FN(ZOR_ALL, Status, zorsAutoCorr_32f, (const float* pSrc, int srcLen, float* pDst, int dstLen))

/* ---- signal/speech/melfbank ---- */

ZOR_FN(ZOR_ALL, Status, zorsMelFBankInitAlloc_32f,
       (void** ppFBank, int* pFFTOrder, int winLen, float sampFreq, float lowFreq, float highFreq,
        int nFilter, float melMul, float melDiv, int mode))
ZOR_FN(ZOR_ALL, Status, zorsEvalFBank_32f, (const float* pSrc, float* pDst, void* pFBank))
ZOR_FN(ZOR_ALL, Status, zorsFBankFree_32f, (void* pFBank))

/* ---- signal/speech/cepstral ---- */

ZOR_FN(ZOR_SSE2UP, Status, zorsPreemphasize_32f, (float* pSrcDst, int len, float val))
ZOR_FN(ZOR_GENERIC, Status, zorsCopyWithPadding_32f,
       (const float* pSrc, int lenSrc, float* pDst, int lenDst))
ZOR_FN(ZOR_GENERIC, Status, zorsDCTLifterInitAlloc_32f,
       (void** ppDCTLifter, int lenDCT, int lenCeps, int nLifter, float val))
ZOR_FN(ZOR_SSE2UP, Status, zorsDCTLifter_32f,
       (const float* pSrc, float* pDst, const void* pDCTLifter))
ZOR_FN(ZOR_GENERIC, Status, zorsDCTLifterFree_32f, (void* pDCTLifter))
ZOR_FN(ZOR_GENERIC, Status, zorsNormEnergy_32f,
       (float* pSrcDst, int step, int height, float silFloor, float energyScale))
ZOR_FN(ZOR_GENERIC, Status, zorsSignChangeRate_16s, (const int16_t* pSrc, int len, int32_t* pRes))
ZOR_FN(ZOR_GENERIC, Status, zorsAutoCorrLagMax_Fwd_16s,
       (const int16_t* pSrc, int len, int lowerLag, int upperLag, int32_t* pMax, int* pMaxLag))

/* ---- frame/adapters ---- */

/* ---- image/filter/floodfill ---- */

/* ---- matrix/qr ---- */

/* ---- image/stats/reductions ---- */

/* ---- image/stats/histogram ---- */

/* ---- image/stats/moments ---- */

/* ---- image/geometry/resize ---- */

/* ---- image/geometry/rotate ---- */

/* ---- image/geometry/warp ---- */

/* ---- image/filter/smoothing ---- */

/* ---- image/pixel/arith ---- */

/* ---- image/color/color ----
 * Colour model conversions of whole images; every one checks the pointers,
 * then the size (no step is checked: steps are used as given).
 * Fixed-point YCbCr forms give exactly the bytes of their integer formulas,
 * including the low-8-bit chroma wrap, the second luma of a 4:2:2 pair
 * without the rounding half and the 4:2:0 one-eighth rounding term.
 * 4:2:0 forms convert the even part of the ROI and return StatusWarnOddSize
 * when a side is odd; a null step array is a null pointer like the others.
 * HSV, HLS and YCC compute in double precision and round stores as
 * trunc(x + 0.499999) (the 16-bit grey truncates); for 8-bit data that is
 * the exact rational value rounded to nearest with halves down, which the
 * SIMD RGB-to-HSV rows compute exactly (the other floating-point forms share
 * one entry).
 * ColorToGray: float weight w becomes trunc(w * 4096 + 0.5) taken modulo
 * 2^32 (8u forms); a truncated value that is NaN or of magnitude 2^63 or
 * more counts as 0; 16u forms store the truncated sum modulo 2^16 (NaN and
 * magnitudes of 2^63 or more give 0).  A null coefficient pointer selects
 * the default weights. */
ZOR_FN(ZOR_SSE2UP, Status, zoriRGBToYCbCr_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriYCbCrToRGB_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriRGBToHSV_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_GENERIC, Status, zoriHSVToRGB_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_GENERIC, Status, zoriRGBToHLS_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_GENERIC, Status, zoriHLSToRGB_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_GENERIC, Status, zoriRGBToYCC_16s_C3R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_GENERIC, Status, zoriYCCToRGB_16s_C3R,
       (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriRGBToYCbCr422_8u_C3C2R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriYCbCr422ToRGB_8u_C2C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriBGRToYCbCr420_8u_C3P3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], const int dstStep[3], ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriYCbCr420ToBGR_8u_P3C3R,
       (const uint8_t* const pSrc[3], const int srcStep[3], uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriRGBToGray_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriColorToGray_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, const float coeffs[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriColorToGray_8u_AC4C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, const float coeffs[3]))
ZOR_FN(ZOR_GENERIC, Status, zoriColorToGray_16u_C3C1R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize, const float coeffs[3]))
ZOR_FN(ZOR_GENERIC, Status, zoriColorToGray_16u_AC4C1R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize, const float coeffs[3]))

/* ---- image/color/jpeg ----
 * Baseline JPEG building blocks.  Quantisation tables are 64 entries in
 * natural (row-major) order except the raw table, which is in zigzag order.
 * The forward DCT (Loeffler-Ligtenberg-Moschytz, 16-bit row results scaled
 * by 8) on level-shifted samples, per 8 samples x0..x7 of a row, then of a
 * column, with t_k = x_k + x_(7-k), d_k = x_k - x_(7-k), a >>> n meaning
 * (a + 2^(n-1)) >> n:
 *   even: e0 = t0 + t3, e3 = t0 - t3, e1 = t1 + t2, e2 = t1 - t2,
 *         z = 17734 (e2 + e3);  X2 = z + 25080 e3,  X6 = z - 60547 e2
 *         (row: X0 = 8 (e0 + e1), X4 = 8 (e0 - e1), X2 >>> 12, X6 >>> 12;
 *          column: (e0 + e1) >>> 6, (e0 - e1) >>> 6, X2 >>> 21, X6 >>> 21)
 *   odd:  o_k = (46341 d_k) >>> 12, then the rotations
 *         z = 799 (o2 + o1):   a = z + 3218 o2,  b = z - 4816 o1,
 *         z = 3406 (o3 + o0):  c = z - 5681 o3,  d = z - 1130 o0,
 *         each >>> 12 (row) or >>> 18 (column), and
 *         X3 = c - a, X5 = b + d, X1 = 46341 (a - b + c + d) >>> 16,
 *         X7 = 46341 (a + b + c - d) >>> 16
 *         (column: X3, X5 >>> 3 and X1, X7 >>> 19 instead).
 * The inverse is the transpose of that flow with the same constants, exact
 * in 64-bit intermediates except for one rounding of the odd part before its
 * last sqrt 2 and one of each pass's results (columns kept at 2^3, rows
 * divided by 8 with the level shift added back and clamped). */
ZOR_FN(ZOR_SSE2UP, Status, zoriBGRToY_JPEG_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriBGRToYCbCr_JPEG_8u_C3P3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSampleDownH2V2_JPEG_8u_C1R,
       (const uint8_t* pSrc, int srcStep, ImageSize srcRoiSize, uint8_t* pDst, int dstStep, ImageSize dstRoiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriBGRToYCbCr422LS_MCU_8u16s_C3P3R,
       (const uint8_t* pSrc, int srcStep, int16_t* const pDstMCU[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriJoin422LS_MCU_16s8u_P3C2R,
       (const int16_t* const pSrcMCU[3], uint8_t* pDst, int dstStep))
ZOR_FN(ZOR_SSE2UP, Status, zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R,
       (const uint8_t* pSrc, int srcStep, int16_t* pDst, const uint16_t* pQuantFwdTable))
ZOR_FN(ZOR_GENERIC, Status, zoriDCTQuantInv8x8LS_JPEG_16s8u_C1R,
       (const int16_t* pSrc, uint8_t* pDst, int dstStep, const uint16_t* pQuantInvTable))
ZOR_FN(ZOR_GENERIC, Status, zoriQuantFwdTableInit_JPEG_8u16u,
       (const uint8_t* pQuantRawTable, uint16_t* pQuantFwdTable))

/* ---- signal/transform/dft2d ---- */
