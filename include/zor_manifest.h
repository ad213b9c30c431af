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

/* ---- frame/adapters ----
 * Fixed-size forms kept for older callers.  Each variant's adapter calls the
 * same variant's general function directly and returns its status unchanged
 * (it checks nothing itself):
 *   Sobel3x3_Dx_*  = FilterSobelVert_8u16s / FilterSobelVertMask_32f, mask 33
 *   Sobel3x3_Dy_*  = FilterSobelHoriz_8u16s / FilterSobelHorizMask_32f, mask 33;
 *                    `reserved` is accepted and ignored (older callers pass it)
 *   QR*_3x3        = the general QR functions on 3 x 3 matrices of densely
 *                    packed doubles (element stride 8); only the row stride of
 *                    the matrix comes from the caller. */
ZOR_FN(ZOR_ALL, Status, zoriSobel3x3_Dx_8u16s_C1R, (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriSobel3x3_Dy_8u16s_C1R, (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, int reserved, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriSobel3x3_Dx_32f_C1R,   (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriSobel3x3_Dy_32f_C1R,   (const float* pSrc, int srcStep, float* pDst, int dstStep, int reserved, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zormQRDecomp_m_64f_3x3,     (const double* pSrc, int srcStride1, double* pBuffer, double* pDst, int dstStride1))
ZOR_FN(ZOR_ALL, Status, zormQRBackSubst_mv_64f_3x3, (const double* pSrc, int srcStride1, double* pBuffer, const double* pSrc2, double* pDst))

/* ---- image/filter/floodfill ----
 * In-place fills from a seed, in the caller's buffer (GetSize bytes; no
 * memory is allocated).  Checks: pointers, sizes, imageStep < width
 * (StatusBadStep), seed outside the ROI (StatusOutOfRange).
 *   4Con:      the 4-connected region of pixels equal to the seed's value.
 *              A seed already holding newVal: StatusOk, nothing written
 *              (the record neither).
 *   Grad4Con, Grad8Con: the region grown from the seed through 4 (8)
 *              neighbours: a neighbour of value n joins from a region pixel
 *              of value c when c - minDelta <= n <= c + maxDelta, with the
 *              values before the fill.  The window moves with the pixel the
 *              region grows from, not with the seed.  No early return when
 *              the seed holds newVal (other pixels may change).
 * The record: area = pixels filled, value = {newVal, 0, 0} (gradient forms
 * too), rect = their bounding box.  A buffer of the size given suffices for
 * every picture; only 4Con on a ROI of more than 3 * 2^30 pixels (whose
 * size no int can give) may stop with StatusNoMemory, partly filled. */
ZOR_FN(ZOR_GENERIC, Status, zoriFloodFillGetSize,      (ImageSize roiSize, int* pSize))
ZOR_FN(ZOR_GENERIC, Status, zoriFloodFillGetSize_Grad, (ImageSize roiSize, int* pSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriFloodFill_4Con_8u_C1IR,
       (uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed, uint8_t newVal,
        ConnectedComp* pRegion, uint8_t* pBuffer))
ZOR_FN(ZOR_SSE2UP, Status, zoriFloodFill_Grad4Con_8u_C1IR,
       (uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed, uint8_t newVal,
        uint8_t minDelta, uint8_t maxDelta, ConnectedComp* pRegion, uint8_t* pBuffer))
ZOR_FN(ZOR_SSE2UP, Status, zoriFloodFill_Grad8Con_8u_C1IR,
       (uint8_t* pImage, int imageStep, ImageSize roiSize, ImagePoint seed, uint8_t newVal,
        uint8_t minDelta, uint8_t maxDelta, ConnectedComp* pRegion, uint8_t* pBuffer))

/* ---- matrix/qr ----
 * Matrices: element (i, j) at base + i * stride1 + j * stride2 bytes; vectors
 * base + i * stride2.  Strides below 1 or not a multiple of the element size:
 * StatusBadStride; width > height: StatusBadMatrixShape.
 * QRDecomp: Householder QR; R in and above the diagonal, below it the
 *   reflection vectors (leading 1 implied).  A column whose remaining norm
 *   is below the double epsilon stops the work with StatusDivideByZero, the
 *   destination partly transformed.  A zero diagonal element, +0 or -0,
 *   reflects like a negative one.  pBuffer: height doubles of scratch.
 * QRBackSubst: least-squares x (width elements) of A x = b from the
 *   decomposition; pBuffer: height doubles of scratch.  No test for a zero
 *   diagonal.
 * Sums run in index order in every variant, so every variant gives the
 * same bits. */
ZOR_FN(ZOR_ALL, Status, zormQRDecomp_m_64f,
       (const double* pSrc, int srcStride1, int srcStride2, double* pBuffer, double* pDst,
        int dstStride1, int dstStride2, int width, int height))
ZOR_FN(ZOR_ALL, Status, zormQRBackSubst_mv_64f,
       (const double* pSrc, int srcStride1, int srcStride2, double* pBuffer, const double* pSrc2,
        int src2Stride2, double* pDst, int dstStride2, int width, int height))
ZOR_FN(ZOR_ALL, Status, zormMul_vc_32f,
       (const float* pSrc, int srcStride2, float val, float* pDst, int dstStride2, int len))

/* ---- image/stats/reductions ---- */

/* ---- image/stats/histogram ---- */

/* ---- image/stats/moments ---- */

/* ---- image/geometry/resize ---- */

/* ---- image/geometry/rotate ---- */

/* ---- image/geometry/warp ---- */

/* ---- image/filter/smoothing ----
 * Fixed smoothing filters, the Wiener filter and full convolution.  The
 * neighbourhood filters do no border handling: the caller passes the ROI
 * inside a larger image and every source pixel a neighbourhood touches must
 * exist.  C3 forms filter each channel on its own.
 * Checks, in this order, first failure wins, nothing written on failure:
 * null pointers (StatusNullPointer), ROI or image width or height below 1
 * (StatusBadSize), a step below 1 (StatusBadStep; steps are not compared
 * with the widths), then the function's own arguments as listed below.
 * Every variant gives the same bytes (the same bits for floats).
 *
 * FilterBox_8u_C1R, _C3R: with anchor (ax, ay) the neighbourhood of ROI pixel
 *   (x, y) is source columns x - ax .. x - ax + mW - 1 and rows y - ay ..
 *   y - ay + mH - 1 (no flipping); dst = (sum + N / 2) / N in integers,
 *   N = mW mH: the mean rounded half up.  mW or mH below 1:
 *   StatusBadMaskSize; ax outside 0 .. mW - 1 or ay outside 0 .. mH - 1:
 *   StatusBadAnchor.  Running sums: the time per pixel does not grow with
 *   the mask.
 * FilterGauss_8u_C1R, _C3R: mask 33 (MaskSize3x3): weights [1 2 1] x [1 2 1],
 *   dst = (sum + 8) >> 4; mask 55: [1 4 6 4 1] x [1 4 6 4 1], dst = (sum +
 *   128) >> 8; centred on the pixel (reads 1 or 2 pixels around the ROI);
 *   any other mask: StatusBadMaskSize.
 * FilterLowpass_8u_C1R: mask 33 or 55: the centred 3x3 or 5x5 box mean of
 *   FilterBox, (sum + 4) / 9 or (sum + 12) / 25; other: StatusBadMaskSize.
 * FilterHipass_8u_C1R: mask 33: weight 8 at the centre and -1 at the other
 *   8 pixels; 55: 24 at the centre, -1 at the other 24; centred; the sum
 *   saturated to 0 .. 255.  Other mask: StatusBadMaskSize.
 * FilterWienerGetBufferSize: the bytes of pBuffer that FilterWiener needs
 *   for that ROI size, mask and channel count (a size for more channels
 *   covers fewer).  Null pBufferSize -8, ROI below 1 -6, a mask that
 *   FilterWiener refuses StatusBadMaskSize, channels below 1
 *   StatusBadChannelCount, a size beyond the int range StatusBadSize.
 * FilterWiener_8u_C1R: over the neighbourhood of FilterBox (checked the
 *   same way, and more than 2^18 mask pixels is StatusBadMaskSize too; then
 *   noise[0]) with S the sum and Q the sum of squares of its N pixels and
 *   p = src(x, y):
 *     mean m = S / N, variance v = Q / N - m^2 = (N Q - S^2) / N^2,
 *     noise variance n = noise[0] 255^2,
 *     dst = m + max(v - n, 0) / max(v, n) (p - m), and m where v = n = 0,
 *   computed in double as D = N Q - S^2 (exact), g = max(D - n N^2, 0) /
 *   max(D, n N^2) (0 where both are 0), dst = floor((S + g (N p - S)) / N
 *   + 0.5) clamped to 0 .. 255.  noise[0] outside [0, 1) (NaN included):
 *   StatusBadArgument.  noise[0] = 0 asks for an estimate: n becomes the
 *   mean of v over the ROI pixels (exact sum of D, then divided by N^2 and
 *   the pixel count in double), noise[0] is set to (float)(n / 255^2) and
 *   that float is used, so a second call with the returned value gives the
 *   same image.  pBuffer: at least the FilterWienerGetBufferSize bytes (with
 *   channels 1), any alignment.
 * ConvFull_32f_C1R: full two-dimensional convolution, dst W x H with W =
 *   w1 + w2 - 1, H = h1 + h2 - 1 (beyond the int range: StatusBadSize):
 *     dst(x, y) = sum over j, i of src2(i, j) src1(x - i, y - j)
 *   over the terms whose two pixels exist; products and sum in double,
 *   starting from +0 and adding in order of j then i ascending, rounded once
 *   to float.
 * ConvFull_8u_C1R: the same sum in exact integers, dst = floor(sum /
 *   divisor + 1/2) saturated to 0 .. 255 (so a negative divisor gives 0
 *   everywhere); divisor 0: StatusBadDivisor. */
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterBox_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
        ImagePoint anchor))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterBox_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
        ImagePoint anchor))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterGauss_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterGauss_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterLowpass_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterHipass_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_GENERIC, Status, zoriFilterWienerGetBufferSize,
       (ImageSize dstRoiSize, ImageSize maskSize, int channels, int* pBufferSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriFilterWiener_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
        ImagePoint anchor, float noise[1], uint8_t* pBuffer))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvFull_32f_C1R,
       (const float* pSrc1, int src1Step, ImageSize src1Size, const float* pSrc2, int src2Step,
        ImageSize src2Size, float* pDst, int dstStep))
ZOR_FN(ZOR_SSE2UP, Status, zoriConvFull_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, ImageSize src1Size, const uint8_t* pSrc2, int src2Step,
        ImageSize src2Size, uint8_t* pDst, int dstStep, int divisor))

/* ---- image/pixel/arith ----
 * Pixel arithmetic, logic, threshold, compare, alpha composition and
 * deinterlacing on one-channel images (four-channel for AlphaComp).
 * Checks, in this order: null pointers (StatusNullPointer), ROI width or
 * height below 1 (StatusBadSize), any step below 1 (StatusBadStep), then the
 * function's own argument (StatusBadArgument); on failure nothing is written.
 * The destination may be one of the sources (same pointer and step), except
 * for DeinterlaceFilterTriangle, whose destination must not overlap its source.
 *
 * Add, Sub, Mul _8u_C1RSfs: the exact integer r = src1 + src2, src2 - src1
 *   (the second operand minus the first), src1 * src2 is scaled by
 *   2^-scaleFactor and saturated to 0..255: scaleFactor > 0 rounds to
 *   nearest with ties to even (5 * 1 with scale 1 gives 2, 7 * 1 gives 4),
 *   scaleFactor < 0 shifts left.  Any scaleFactor is accepted.
 * MulC_8u_C1RSfs: r = src * value, scaled likewise.  A value of 0 or a scale
 *   factor above 16 sets the ROI to 0 without reading the source; a scale
 *   factor below -7 gives 255 for every non-zero product and 0 for zero.
 * AbsDiff_8u_C1R: |src1 - src2|.
 * Add, Sub, Mul _32f_C1R: src1 + src2, src2 - src1, src1 * src2 in float
 *   (IEEE single, rounded to nearest).  Where both operands are NaN, which
 *   of them comes out (quieted) is the processor's choice.
 * And, Or, Xor _8u_C1R: bitwise on two sources; Not_8u_C1R: ~src.
 * Threshold_8u_C1R: relOp CmpLess raises values below threshold to it,
 *   CmpGreater lowers values above it; any other relOp: StatusBadArgument.
 * Threshold_LTValGTVal_8u_C1R: v < thresholdLT gives valueLT, v >
 *   thresholdGT gives valueGT, other values stay; thresholdLT > thresholdGT:
 *   StatusBadArgument.
 * Compare_8u_C1R: 255 where src1 op src2 holds, else 0; CompareC_8u_C1R the
 *   same with src op value.  cmpOp: CmpLess <, CmpLessEq <=, CmpEq ==,
 *   CmpGreaterEq >=, CmpGreater >; any other: StatusBadArgument.
 * AlphaComp_8u_AC4R: Porter-Duff on non-premultiplied RGBA (alpha the fourth
 *   byte), A = src1, B = src2, aA = a1 / 255, aB = a2 / 255:
 *     colour = cA aA FA + cB aB FB,  alpha = aA FA + aB FB,
 *   colours and 255 * alpha rounded half up (exactly: with a1, a2 and the
 *   factors scaled by 255, (n + 32512) / 65025 in integers) and written to
 *   all four destination bytes.  alphaType (FA, FB): AlphaOver (1, 1 - aA),
 *   AlphaIn (aB, 0), AlphaOut (1 - aB, 0), AlphaATop (aB, 1 - aA), AlphaXor
 *   (1 - aB, 1 - aA), AlphaPlus (1, 1, results saturated at 255); any other:
 *   StatusBadArgument.
 * AlphaCompC_8u_C1R: the same colour rule with the constant alphas alpha1,
 *   alpha2 for every pixel.
 * DeinterlaceFilterTriangle_8u_C1R: with c = centerWeight, a, m, b the pixels
 *   above, at and below (x, y), rows outside the ROI replaced by the nearest
 *   edge row (only ROI rows are read):
 *     dst = (a (256 - c) / 2 + m c + b (256 - c) / 2 + 128) >> 8
 *   with the outer weights taken exactly (a half for odd c), i.e.
 *     dst = ((a + b) (256 - c) + 2 m c + 256) >> 9.
 *   centerWeight > 256 or layout other than 0 (whole frame):
 *   StatusBadArgument. */
ZOR_FN(ZOR_SSE2UP, Status, zoriAdd_8u_C1RSfs,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zoriSub_8u_C1RSfs,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zoriMul_8u_C1RSfs,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zoriMulC_8u_C1RSfs,
       (const uint8_t* pSrc, int srcStep, uint8_t value, uint8_t* pDst, int dstStep, ImageSize roiSize,
        int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zoriAbsDiff_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriAdd_32f_C1R,
       (const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriSub_32f_C1R,
       (const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriMul_32f_C1R,
       (const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriAnd_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriOr_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriXor_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriNot_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriThreshold_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, uint8_t threshold,
        int relOp))
ZOR_FN(ZOR_SSE2UP, Status, zoriThreshold_LTValGTVal_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, uint8_t thresholdLT,
        uint8_t valueLT, uint8_t thresholdGT, uint8_t valueGT))
ZOR_FN(ZOR_SSE2UP, Status, zoriCompare_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize, int cmpOp))
ZOR_FN(ZOR_SSE2UP, Status, zoriCompareC_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t value, uint8_t* pDst, int dstStep, ImageSize roiSize,
        int cmpOp))
ZOR_FN(ZOR_SSE2UP, Status, zoriAlphaComp_8u_AC4R,
       (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
        ImageSize roiSize, int alphaType))
ZOR_FN(ZOR_SSE2UP, Status, zoriAlphaCompC_8u_C1R,
       (const uint8_t* pSrc1, int src1Step, uint8_t alpha1, const uint8_t* pSrc2, int src2Step, uint8_t alpha2,
        uint8_t* pDst, int dstStep, ImageSize roiSize, int alphaType))
ZOR_FN(ZOR_SSE2UP, Status, zoriDeinterlaceFilterTriangle_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, uint32_t centerWeight,
        uint32_t layout))

/* ---- image/color/color ---- */

/* ---- image/color/jpeg ---- */

/* ---- signal/transform/dft2d ----
 * Two-dimensional DFT of a real float image of any width W >= 1 and height
 * H >= 1: Y(u, v) = sum over rows y and columns x of
 * src(x, y) exp(-2 pi i (u y / H + v x / W)).
 * zoriDFTInitAlloc_R_32f makes a spec for images of roiSize; its record
 * starts with these 32-bit fields (byte offsets): 0 identifier (7), 4 width,
 * 8 height, 12 forwardScaled, 16 inverseScaled, 20 scale (float),
 * 24 hint, 28 bufferSize, 32 allocated (1).
 * flag: 8 no normalisation, 1 forward divided by W H, 2 inverse divided by
 * W H, 4 both divided by sqrt(W H); hint is kept and changes nothing.
 * Checks, first failure wins, nothing written on failure:
 *   InitAlloc: null ppSpec -8, W or H < 1 -6, other flag -16, allocation
 *   failure -9 (nothing kept).  Free: null -8, identifier not 7 -17.
 *   Fwd, Inv: null pSpec -8, identifier not 7 -17, null image -8, a step
 *   below 4 W -14, a step that is no multiple of 4 -108.
 * Packed layout, the one cv::dft gives for a real 2-D input without
 * DFT_COMPLEX_OUTPUT (CCS), W x H floats, element (column, row):
 *   column 0 runs down the CCS of spectrum column 0: Re Y(0,0), Re Y(1,0),
 *   Im Y(1,0), Re Y(2,0), Im Y(2,0) ... ending with Re Y(H/2,0) when H is
 *   even (Im Y(0,0) and Im Y(H/2,0), always 0, are not stored);
 *   for even W, column W-1 holds spectrum column W/2 the same way;
 *   columns 2k-1 and 2k, 0 < k < W/2, hold Re Y(u,k) and Im Y(u,k) in row
 *   u, u = 0 .. H-1.  A single row is thus the 1-D CCS Re Y0, Re Y1,
 *   Im Y1, ... and a single column the same down the column.
 * The inverse reads that layout as the spectrum of a real image (the
 * missing half by conjugate symmetry) and writes the sum of
 * Y(u, v) exp(+2 pi i (u y / H + v x / W)) times the inverse scale:
 * forward then inverse gives the image back with flags 1, 2 and 4, and
 * W H times the image with flag 8.
 * In place: pSrc == pDst with equal steps.
 * pBuffer: with a null pBuffer the call allocates its work area itself
 * (-9 when that fails).  A caller's buffer needs bufferSize bytes (the
 * record field; 0: the call needs none) and is rounded up to 32 bytes
 * inside; 1024 max(W, H) + 4096 bytes is always enough.
 * Accuracy as the 1-D FFT's: within float rounding of the exact
 * transform, for every size (sizes with a prime factor above 31 go through
 * a chirp convolution).  Every variant gives the same bits, except where
 * intermediate values leave float's normal range (denormal or overflowing
 * values; the 32-bit generic variant keeps them with the x87 exponent). */
ZOR_FN(ZOR_ALL, Status, zoriDFTInitAlloc_R_32f, (void** ppSpec, ImageSize roiSize, int flag, int hint))
ZOR_FN(ZOR_ALL, Status, zoriDFTFree_R_32f, (void* pSpec))
ZOR_FN(ZOR_ALL, Status, zoriDFTFwd_RToPack_32f_C1R,
       (const float* pSrc, int srcStep, float* pDst, int dstStep, const void* pSpec, uint8_t* pBuffer))
ZOR_FN(ZOR_ALL, Status, zoriDFTInv_PackToR_32f_C1R,
       (const float* pSrc, int srcStep, float* pDst, int dstStep, const void* pSpec, uint8_t* pBuffer))
