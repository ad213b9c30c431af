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
 * columns (generic, SSE, SSE2, SSE3, SSSE3), and on x86-64 the two wide
 * columns (AVX2, AVX-512; frame/columns.h):
 *   ZOR_ALL      each variant has its own entry
 *   ZOR_GENERIC  the generic entry serves every processor
 *   ZOR_SSE2UP   generic entry for the generic and SSE columns
 *   ZOR_WIDE, ZOR_SSE2UP_WIDE  the same, with entries of their own in the
 *                wide columns (the family is compiled for them)
 *
 * No include guard: the file is included once per expansion.
 */

/* ---- frame/alloc-version ----
 * Aligned allocation and version records. */

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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriCopy_8u_C3P3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C3P3R,
       (const int16_t* pSrc, int srcStep, int16_t* const pDst[3], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_8u_C4P4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[4], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriCopy_16s_C4P4R,
       (const int16_t* pSrc, int srcStep, int16_t* const pDst[4], int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriCopy_8u_P3C3R,
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSet_8u_C3R,
       (const uint8_t value[3], uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSet_16s_C3R,
       (const int16_t value[3], int16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriSet_8u_C3MR,
       (const uint8_t value[3], uint8_t* pDst, int dstStep, ImageSize roiSize,
        const uint8_t* pMask, int maskStep))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSwapChannels_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSwapChannels_16u_C3R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSwapChannels_8u_AC4R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSwapChannels_16u_AC4R,
       (const uint16_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize,
        const int dstOrder[3]))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriSwapChannels_8u_C3IR,
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

ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_8u16u_C1R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_8u16u_C3R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_8u16u_C4R,
       (const uint8_t* pSrc, int srcStep, uint16_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_8u32f_C1R,
       (const uint8_t* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_16s32f_C1R,
       (const int16_t* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriConvert_32f8u_C1R,
       (const float* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, int roundMode))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriLShiftC_16u_C1IR,
       (uint32_t value, uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriLShiftC_16u_C3IR,
       (const uint32_t value[3], uint16_t* pSrcDst, int srcDstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriLShiftC_16u_AC4IR,
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
ZOR_FN(ZOR_WIDE, Status, zoriFilter_8u_C1R,    (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_WIDE, Status, zoriFilter_8u_C3R,    (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_WIDE, Status, zoriFilter_16s_C1R,   (const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize dstRoiSize, const int32_t* pKernel, ImageSize kernelSize, ImagePoint anchor, int divisor))
ZOR_FN(ZOR_WIDE, Status, zoriFilter32f_8u_C1R, (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))
ZOR_FN(ZOR_WIDE, Status, zoriFilter32f_8u_C3R, (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))
ZOR_FN(ZOR_WIDE, Status, zoriFilter32f_16s_C1R,(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize dstRoiSize, const float* pKernel, ImageSize kernelSize, ImagePoint anchor))

/* ---- image/filter/sobel ----
 * Border types of the ...Border_ forms.  Only the ROI is read; the pixels
 * outside it are synthesised in the work buffer:
 *   0  replicate:           a a a | a b c ... x y z | z z z
 *   1  constant:            v v v | a b c ... x y z | v v v   (v = borderValue)
 *   2  mirror, edge not repeated:  d c b | a b c d ... (a 1-pixel side replicates)
 *   3  mirror, edge repeated:      c b a | a b c ...
 *   4  wrap:                x y z | a b c ... x y z | a b c
 * borderValue is used by type 1 only.  Any other type: StatusBadArgument. */
ZOR_FN(ZOR_WIDE, Status, zoriFilterSobelHoriz_8u_C1R,      (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHoriz_32f_C1R,     (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVert_32f_C1R,      (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelHorizMask_32f_C1R, (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_ALL, Status, zoriFilterSobelVertMask_32f_C1R,  (const float* pSrc, int srcStep, float* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_WIDE, Status, zoriFilterSobelHoriz_8u16s_C1R,   (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_WIDE, Status, zoriFilterSobelVert_8u16s_C1R,    (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask))
ZOR_FN(ZOR_WIDE, Status, zoriFilterSobelHorizBorder_8u16s_C1R, (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, uint8_t borderValue, uint8_t* pBuffer))
ZOR_FN(ZOR_WIDE, Status, zoriFilterSobelVertBorder_8u16s_C1R,  (const uint8_t* pSrc, int srcStep, int16_t* pDst, int dstStep, ImageSize roiSize, int mask, int borderType, uint8_t borderValue, uint8_t* pBuffer))
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsConvert_8u32f,  (const uint8_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_8s32f,  (const int8_t* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsConvert_16s32f, (const int16_t* pSrc, float* pDst, int len))
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsConvert_32f16s_Sfs,
       (const float* pSrc, int16_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_32f32s_Sfs,
       (const float* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor))
ZOR_FN(ZOR_SSE2UP, Status, zorsConvert_64f32s_Sfs,
       (const double* pSrc, int32_t* pDst, int len, int rndMode, int scaleFactor))

/* ---- signal/vector/arith ---- */
ZOR_FN(ZOR_WIDE,    Status, zorsAdd_32f,          (const float* pSrc1, const float* pSrc2, float* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsAdd_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSub_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsMul_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsDiv_32f_I,        (const float* pSrc, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsAddC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSubC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSubC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsMulC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsMulC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsDivC_32f,         (const float* pSrc, float val, float* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsDivC_32f_I,       (float val, float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAdd_16s_Sfs,      (const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAddC_16s_I,       (int16_t val, int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsSubC_16s_I,       (int16_t val, int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMul_NR_16s_Sfs,   (const int16_t* pSrc1, const int16_t* pSrc2, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMul_NR_16s_ISfs,  (const int16_t* pSrc, int16_t* pSrcDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMulC_NR_16s_Sfs,  (const int16_t* pSrc, int16_t val, int16_t* pDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsMulC_NR_16s_ISfs, (int16_t val, int16_t* pSrcDst, int len, int scaleFactor))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_16s,          (const int16_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsAbs_32f,          (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_64f,          (const double* pSrc, double* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_16s_I,        (int16_t* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsAbs_32f_I,        (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsAbs_64f_I,        (double* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSqr_32f,          (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSqr_32f_I,        (float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsSqrt_32f_I,       (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsLn_32f_I,         (float* pSrcDst, int len))
ZOR_FN(ZOR_WIDE,    Status, zorsThreshold_32f_I,  (float* pSrcDst, int len, float level, int relOp))
ZOR_FN(ZOR_WIDE,    Status, zorsThreshold_LTVal_32f,   (const float* pSrc, float* pDst, int len, float level, float value))
ZOR_FN(ZOR_WIDE,    Status, zorsThreshold_LTVal_32f_I, (float* pSrcDst, int len, float level, float value))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsNormalize_32f,    (const float* pSrc, float* pDst, int len, float vSub, float vDiv))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsMagnitude_32f,    (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsMagnitude_32fc,  (const Complex32f* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsPhase_32f,        (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsPowerSpectr_32f,  (const float* pSrcRe, const float* pSrcIm, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsAtan2_32f_A21,    (const float* pSrc1, const float* pSrc2, float* pDst, int len))
ZOR_FN(ZOR_ALL,     Status, zorsSortDescend_32f_I, (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsDeinterleave_16s, (const int16_t* pSrc, int channels, int len, int16_t** pDst))

/* ---- signal/vector/stats ----
 * The float reductions accumulate in double in a fixed order, the same in
 * every variant and column, so every processor gives the same bits.
 * Sum, mean, standard deviation: two partial sums, the even and the odd
 * elements of each group of four, added together, then the remainder.
 * zorsDotProd_32f, zorsNorm_L2_32f, zorsNormDiff_L2_32f: the terms (products,
 * squares, squared differences, exact in double for products and squares)
 * go to 32 partial sums, element i of each full block of 32 to sum i mod 32;
 * the sums are combined by halving (s[j] + s[j + 16] for j < 16, then
 * s[j] + s[j + 8] for j < 8, s[j] + s[j + 4], s[j] + s[j + 2], s0 + s1), and
 * the last len mod 32 terms added one by one in index order.  The L2 norms
 * take the square root in double; each result is rounded once to float.
 * A NaN result of these three is the input NaN with the largest payload
 * (bits below the sign, the first in index order among equals) among the
 * elements read, quieted, or the default NaN where no input is a NaN.
 * The integer reductions are exact 64-bit sums. */
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsNorm_L2_32f,      (const float* pSrc, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsNorm_L2_16s32f,   (const int16_t* pSrc, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsNormDiff_L2_32f,  (const float* pSrc1, const float* pSrc2, int len, float* pNorm))
ZOR_FN(ZOR_SSE2UP,  Status, zorsNorm_L1_16s32s_Sfs, (const int16_t* pSrc, int len, int32_t* pNorm, int scaleFactor))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsDotProd_32f,      (const float* pSrc1, const float* pSrc2, int len, float* pDp))
ZOR_FN(ZOR_SSE2UP,  Status, zorsDotProd_16s32s_Sfs, (const int16_t* pSrc1, const int16_t* pSrc2, int len, int32_t* pDp, int scaleFactor))

/* ---- signal/transform/window ---- */

ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16s,    (const int16_t* pSrc, int16_t* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16s_I,  (int16_t* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16sc,   (const Complex16s* pSrc, Complex16s* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_16sc_I, (Complex16s* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_32f,    (const float* pSrc, float* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_32f_I,  (float* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_32fc,   (const Complex32f* pSrc, Complex32f* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_32fc_I, (Complex32f* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_64f,    (const double* pSrc, double* pDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHamming_64f_I,  (double* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64fc,   (const Complex64f* pSrc, Complex64f* pDst, int len))
ZOR_FN(ZOR_SSE2UP,  Status, zorsWinHamming_64fc_I, (Complex64f* pSrcDst, int len))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zorsWinHann_32f_I,     (float* pSrcDst, int len))

/* ---- signal/transform/fft ---- */

ZOR_FN(ZOR_ALL, Status, zorsFFTInitAlloc_C_32f, (void** ppSpec, int order, int flag, int hint))
ZOR_FN(ZOR_ALL, Status, zorsFFTInitAlloc_R_32f, (void** ppSpec, int order, int flag, int hint))
ZOR_FN(ZOR_ALL, Status, zorsFFTFree_C_32f, (void* pSpec))
ZOR_FN(ZOR_ALL, Status, zorsFFTFree_R_32f, (void* pSpec))
ZOR_FN(ZOR_WIDE, Status, zorsFFTFwd_CToC_32f,
       (const float* pSrcRe, const float* pSrcIm, float* pDstRe, float* pDstIm,
        const void* pSpec, uint8_t* pBuffer))
ZOR_FN(ZOR_WIDE, Status, zorsFFTInv_CToC_32f,
       (const float* pSrcRe, const float* pSrcIm, float* pDstRe, float* pDstIm,
        const void* pSpec, uint8_t* pBuffer))
ZOR_FN(ZOR_WIDE, Status, zorsFFTFwd_RToCCS_32f,
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
ZOR_FN(ZOR_WIDE, Status, zorsEvalFBank_32f, (const float* pSrc, float* pDst, void* pFBank))
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

/* ---- image/stats/reductions ----
 * Sums, means, deviations and norms are doubles; extrema keep the pixel type
 * (zoriMinMaxIndx_16u_C3CR: float).  Positions are (column, row) within the
 * ROI of the first occurrence in raster order.  C3CR forms analyse channel
 * coi (1..3) of a three-channel image.
 * Integer sums: each row in 32-bit unsigned arithmetic (wrapping only past
 * 16 million pixels a row), each row total added to a double.
 * zoriSum_32f_C1R, accurate method (hint 2, and any hint in the generic
 * variant): one double accumulator over the even columns and one over the
 * odd columns of every row, top to bottom; the result is odd + even.  Any
 * other hint in the SIMD variants: each row summed in 16 float partial sums
 * (element i into partial i mod 16, the last width mod 16 elements added
 * in double), then added to a double total; the SSE to SSSE3 variants agree
 * with one another, but may differ from the accurate sum in the last bits.
 * zoriMinMax_32f_C1R scans in raster order: v becomes the minimum when
 * !(v >= min), else the maximum when v > max (a NaN becomes the minimum, and
 * the value after it replaces it unconditionally).
 * Standard deviation: population form, sqrt(|sum(v^2)/N - mean^2|), from
 * exact integer sums.  Null result pointers of zoriMean_StdDev_* and
 * zoriMinMaxIndx_16u_C3CR are not an error: those results are not written.
 * zoriMinMax_8u_C3R and zoriMax_8u_C1R stop reading after the row in which
 * no result can change any more (minima 0 and maxima 255). */
ZOR_FN(ZOR_SSE2UP, Status, zoriSum_8u_C1R,  (const uint8_t* pSrc, int srcStep, ImageSize roiSize, double* pSum))
ZOR_FN(ZOR_ALL,    Status, zoriSum_32f_C1R, (const float* pSrc, int srcStep, ImageSize roiSize, double* pSum, int hint))
ZOR_FN(ZOR_SSE2UP, Status, zoriMean_8u_C1R, (const uint8_t* pSrc, int srcStep, ImageSize roiSize, double* pMean))
ZOR_FN(ZOR_SSE2UP, Status, zoriMean_8u_C3R, (const uint8_t* pSrc, int srcStep, ImageSize roiSize, double pMean[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriMean_StdDev_8u_C3CR,  (const uint8_t* pSrc, int srcStep, ImageSize roiSize, int coi, double* pMean, double* pStdDev))
ZOR_FN(ZOR_SSE2UP, Status, zoriMean_StdDev_16u_C3CR, (const uint16_t* pSrc, int srcStep, ImageSize roiSize, int coi, double* pMean, double* pStdDev))
ZOR_FN(ZOR_ALL,    Status, zoriMinMax_32f_C1R, (const float* pSrc, int srcStep, ImageSize roiSize, float* pMin, float* pMax))
ZOR_FN(ZOR_SSE2UP, Status, zoriMinMax_8u_C3R,  (const uint8_t* pSrc, int srcStep, ImageSize roiSize, uint8_t pMin[3], uint8_t pMax[3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriMinMaxIndx_16u_C3CR, (const uint16_t* pSrc, int srcStep, ImageSize roiSize, int coi, float* pMinVal, float* pMaxVal, ImagePoint* pMinIndex, ImagePoint* pMaxIndex))
ZOR_FN(ZOR_SSE2UP, Status, zoriMax_8u_C1R, (const uint8_t* pSrc, int srcStep, ImageSize roiSize, uint8_t* pMax))
ZOR_FN(ZOR_SSE2UP, Status, zoriNormDiff_L1_8u_C1R, (const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, ImageSize roiSize, double* pValue))

/* ---- image/stats/histogram ----
 * nLevels boundaries make nLevels - 1 bins; bin k counts levels[k] <= v <
 * levels[k + 1]; the counts are cleared first.  8u: levels are clamped to
 * 0..256, a bin with lo >= hi counts 0.  32f: levels that are not strictly
 * increasing test every pixel against every bin (overlapping bins count a
 * value more than once); NaN pixels are never counted, and NaN levels never
 * match.  The C3 form checks each channel's pointers and level count before
 * the size and step. */
ZOR_FN(ZOR_SSE2UP, Status, zoriHistogramRange_8u_C1R,  (const uint8_t* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist, const int32_t* pLevels, int nLevels))
ZOR_FN(ZOR_SSE2UP, Status, zoriHistogramRange_32f_C1R, (const float* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist, const float* pLevels, int nLevels))
ZOR_FN(ZOR_SSE2UP, Status, zoriHistogramRange_8u_C3R,  (const uint8_t* pSrc, int srcStep, ImageSize roiSize, int32_t* pHist[3], const int32_t* pLevels[3], const int nLevels[3]))

/* ---- image/stats/moments ----
 * Spatial moments up to order 3 in a MomentState (zor.h).  Row sums use
 * x f, x (x f), x (x (x f)) in double, each in four partial sums (column x
 * into partial x mod 4), combined as (p0 + p2) + (p1 + p3) at the end of
 * the row.  Query orders: m, n >= 0 and m + n <= 3, else StatusBadSize. */
ZOR_FN(ZOR_GENERIC, Status, zoriMomentInitAlloc_64f, (MomentState** ppState, int hint))
ZOR_FN(ZOR_GENERIC, Status, zoriMomentFree_64f, (MomentState* pState))
ZOR_FN(ZOR_SSE2UP,  Status, zoriMoments64f_32f_C1R, (const float* pSrc, int srcStep, ImageSize roiSize, MomentState* pState))
ZOR_FN(ZOR_GENERIC, Status, zoriGetSpatialMoment_64f, (const MomentState* pState, int mOrd, int nOrd, int nChannel, ImagePoint roiOffset, double* pValue))

/* ---- image/geometry/resize ----
 * Arguments: the source pointer is the image origin, srcSize the whole
 * image, srcRoi a rectangle in it; the destination pointer is the first
 * pixel of the destination ROI, dstRoiSize its size; factors are
 * destination / source sizes.
 *
 * Checks, in order: a null pointer -8; a dimension of srcSize, srcRoi or
 * dstRoiSize below 1: -6; a step below 1: -14; the ROI origin outside the
 * image (x or y negative or at least the image's width / height): warning
 * 29, nothing written; a factor not above 0 (NaN included): -23;
 * interpolation other than 1, 2, 4, 8, 16: -22.  The ROI is clipped to the
 * image.  Work memory that cannot be had: -9, nothing written.
 *
 * Mapping: destination pixel i samples x = roi.x + (i + 0.5) / xFactor - 0.5
 * (pixel centres aligned), likewise y.  Neighbours come from the whole
 * image and are clamped to its edge pixels.  Nearest (1): the pixel at
 * floor(x + 0.5).  Linear (2): bilinear.  Cubic (4): Catmull-Rom (a = -0.5),
 * 4 x 4.  Lanczos (16): 3 lobes, 6 x 6, the weights of each direction
 * normalised to sum 1.  Super-sampling (8): the area-weighted mean over
 * [roi.x + i / f, roi.x + (i + 1) / f) x (likewise y), where area beyond
 * the image counts for the edge pixel; in a direction whose factor is above
 * 1, linear instead.  Every destination pixel is written.
 *
 * Results: 8u and 16u round half up and saturate, within +-1 of the exact
 * (double) value of the definition; 32f within 1e-5 of the sum of the
 * magnitudes of the weighted source values (relative to the value where
 * nothing cancels).  A non-finite 32f source value reaches every output
 * whose taps include it, even at weight 0.  Every variant gives the same
 * bits.  How: 8u with at most 8 taps a direction: weights in 1/16384,
 * rows combined to 1/64 of a level, columns to 1/32, the sum rounded half
 * up (the fixed-point value stays within 0.32 of the exact one); float
 * weights and sums formed in tap order in float for 16u with at most 8
 * taps, 32f with at most 32 and 8u with at most 1024; double beyond.  8u
 * super-sampling by exactly 0.5 x 0.5 inside the image: (sum of the 2 x 2
 * pixels + 2) / 4.
 *
 * The 8u exports first apply a read guard: with interpolation 8 and an odd
 * ROI height, when the srcStep bytes after the image (srcSize.height rows
 * of srcStep bytes) cannot be read, they resize from a copy of the image
 * with its last row repeated once below it (same arguments otherwise; the
 * copy's allocation is not checked; no copy is made where srcStep is below
 * the row's bytes or the copy would pass 2 GiB).  On Linux the probe reads
 * the own process through process_vm_readv, which reports instead of
 * faulting.
 *
 * zoriResize_8u_C3R in the SSE2, SSE3 and SSSE3 variants, with
 * interpolation 8 while the marker file (the module's path with its last
 * extension replaced by "xml") existed at load, takes the alternate
 * super-sampling instead: no argument is checked and it returns 0, doing
 * nothing for null pointers, empty sizes or clipped ROIs, factors whose
 * reciprocal is not a positive finite number, or missing work memory.  rx = (float)(1 / xFactor), likewise ry;
 * K = trunc(65536 xFactor yFactor); column i covers [s, min(s + rx, w)) with
 * s = min(max(s0 + i rx, 0), w), s0 = trunc(roi.x xFactor + 0.5) / xFactor
 * - roi.x, w the clipped ROI width, in ROI coordinates (rows likewise); a
 * partial first pixel weighs trunc((1 - frac) 256), whole pixels 256, a
 * partial last pixel trunc(frac 256); row sums are weighted by the row's
 * weight, shifted right by 8, summed in 32 bits; the output is
 * (sum K + 2^23) >> 24 stored without a clamp.  Spans keep 16-bit indices
 * (ROIs up to 65534 pixels a side).
 *
 * zoriGetResizeFract: checks sizes (-6), the ROI origin (29), factors not
 * above 0 (-23; NaN passes), output pointers (-8), interpolation 1, 2, 4,
 * 16 (-22); fraction = 1 / factor (nearest) or (w - 1) / (factor w - 1)
 * when factor w > 1, else 0, w the clipped ROI width (height for y).
 *
 * zoriResizeShift_8u_C3R: destination pixel i samples
 * roi.x + (i - xShift) xFr (likewise y), with the engine's checks except
 * that a fraction of 0 is accepted (every pixel then samples one position;
 * zoriGetResizeFract gives 0 for a one-pixel ROI).  Super-sampling averages
 * [x + 0.5 - xFr / 2, x + 0.5 + xFr / 2), linear where xFr is below 1.
 *
 * zoriResizeCenter_8u_C1R / _C3R: destination pixel i (relative to pDst)
 * samples xCenter + (i - xCenter) (1 / xFactor), likewise y, so the point
 * (xCenter, yCenter) keeps its coordinates; only destination pixels whose
 * sample lies in the clipped ROI's pixel area [roi.x - 0.5, roi.x + w - 0.5)
 * in both directions are written; super-sampling averages a footprint of
 * 1 / factor around the sample, as the shifted resize does.  Checks: pDst
 * null first, then the engine's; nothing to write: 0. */
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResize_8u_C1R,  (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResize_8u_C3R,  (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResize_8u_C4R,  (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_16u_C1R, (const uint16_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint16_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_16u_C3R, (const uint16_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint16_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_16u_C4R, (const uint16_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint16_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_32f_C1R, (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_32f_C3R, (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_WIDE,    Status, zoriResize_32f_C4R, (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation))
ZOR_FN(ZOR_GENERIC, Status, zoriGetResizeFract, (ImageSize srcSize, ImageRect srcRoi, double xFactor, double yFactor, double* pXFr, double* pYFr, int interpolation))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResizeShift_8u_C3R, (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFr, double yFr, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResizeCenter_8u_C1R, (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, double xCenter, double yCenter, int interpolation))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriResizeCenter_8u_C3R, (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor, double yFactor, double xCenter, double yCenter, int interpolation))

/* ---- image/geometry/rotate ----
 * Rotation by an angle in degrees: the source point (x, y) (image
 * coordinates, y downwards) goes to
 *   x' = x c + y s + xShift,   y' = -x s + y c + yShift,
 * with a = angle - 360 trunc(angle / 360), plus 360 when negative, and
 * c = cos(a pi / 180), s = sin(a pi / 180); a = 0, 90, 180, 270 take the
 * exact values (1, 0), (0, 1), (-1, 0), (0, -1), so those rotations carry
 * no rounding error.  Rotate and RotateCenter are the affine warp of that
 * matrix (see image/geometry/warp: pointers are image origins, the same
 * ROIs, checks, interpolation and accuracy rules, a non-finite angle or
 * shift is a bad coefficient: StatusBadArgument).  RotateCenter takes the
 * point (xCenter, yCenter) that stays fixed instead of the shifts.
 * GetRotateShift: the shifts that keep (xCenter, yCenter) fixed:
 *   a = 0: 0, 0;  90: xc - yc, xc + yc;  180: 2 xc, 2 yc;  270: xc + yc, yc - xc;
 *   else xShift = (xc - xc c) - yc s,  yShift = (yc - c yc) + s xc,
 * in double; a null output: StatusNullPointer, nothing else fails.
 * AddRotateShift adds those shifts to the values in its outputs.
 * GetRotateBound: bound[0] = {xmin, ymin}, bound[1] = {xmax, ymax} of the
 * mapped corners (x, y), (x + w - 1, y), (x + w - 1, y + h - 1),
 * (x, y + h - 1) of srcRoi (not clipped to any image).  Checks: null bound
 * -8, ROI width or height below 1 -6, a non-finite angle or shift -5;
 * nothing is written on failure. */
ZOR_FN(ZOR_SSE2UP, Status, zoriRotate_8u_C1R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriRotate_8u_C3R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriRotate_16u_C1R,
       (const uint16_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint16_t* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriRotate_16u_C3R,
       (const uint16_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint16_t* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriRotate_32f_C3R,
       (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xShift, double yShift, int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriRotateCenter_8u_C3R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, double angle, double xCenter, double yCenter, int interpolation))
ZOR_FN(ZOR_GENERIC, Status, zoriGetRotateShift,
       (double xCenter, double yCenter, double angle, double* pxShift, double* pyShift))
ZOR_FN(ZOR_GENERIC, Status, zoriAddRotateShift,
       (double xCenter, double yCenter, double angle, double* pxShift, double* pyShift))
ZOR_FN(ZOR_GENERIC, Status, zoriGetRotateBound,
       (ImageRect srcRoi, double bound[2][2], double angle, double xShift, double yShift))

/* ---- image/geometry/warp ----
 * Warps map source image coordinates to destination image coordinates
 * (x, y: pixel centres at whole numbers, y downwards):
 *   Affine       x' = c00 x + c01 y + c02,          y' = c10 x + c11 y + c12
 *   Bilinear     x' = c00 x y + c01 x + c02 y + c03, y' likewise with c1*
 *   Perspective  x' = (c00 x + c01 y + c02) / (c20 x + c21 y + c22),
 *                y' = (c10 x + c11 y + c12) / (c20 x + c21 y + c22)
 * and are inverted internally.  pSrc and pDst point at pixel (0, 0) of
 * their images; srcRoi and dstRoi are rectangles in them.  srcRoi is
 * clipped to the srcSize image, dstRoi to x >= 0, y >= 0.  Every
 * destination pixel of the clipped dstRoi whose source point (the inverse
 * map in double precision) lies in the closed rectangle of the clipped
 * srcRoi's pixel centres, [x, x + w - 1] x [y, y + h - 1], is interpolated
 * there; every other destination pixel is left untouched.  Only pixels of
 * the clipped srcRoi are read: neighbours outside it are replaced by the
 * nearest edge pixel of the ROI.
 * The source point is carried with 32 fraction bits (within 2^-31 of the
 * double value).  Interpolation:
 *   InterNearest  the pixel at floor(x + 0.5), floor(y + 0.5);
 *   InterLinear   bilinear over the 2 x 2 pixels from floor(x), floor(y);
 *   InterCubic    Catmull-Rom (a = -0.5), separable over 4 x 4 pixels.
 * Results: 8u and 16u round half up and saturate, within 1 of the exact
 * double-precision value of the definition (8u linear weighs the pixels with
 * 14-bit fractions, the point first kept 2^-14 inside the ROI's last pixel
 * interval: within 0.07 before rounding); 32f within 1e-5 of it relative
 * to the largest neighbour's magnitude.  Every code variant gives the same
 * bits.
 * Checks, first failure wins, nothing written on failure: null pSrc, pDst
 * or coefficients -8; srcSize, srcRoi or dstRoi with a dimension below 1
 * -6; a step below 1 -14; interpolation other than 1, 2, 4 -22; bad
 * coefficients -5: not finite, or singular (affine, perspective: zero
 * determinant; bilinear: the Jacobian determinant, affine in x and y, not of
 * one strict sign at the four corners of srcRoi as given, which keeps the
 * map one-to-one on it); then srcRoi outside srcSize or dstRoi outside
 * x >= 0, y >= 0: warning StatusWarnNoOperation (29), nothing written.
 * Work memory that cannot be had: StatusNoMemory.
 * GetAffineBound: bound[0] = {xmin, ymin}, bound[1] = {xmax, ymax} of the
 * corners (x, y), (x + w - 1, y), (x + w - 1, y + h - 1), (x, y + h - 1) of
 * srcRoi mapped by coeffs.  Checks: null -8, ROI dimension below 1 -6, bad
 * coefficients -5 (as the warp's).
 * GetAffineTransform, GetBilinearTransform, GetPerspectiveTransform: the
 * coefficients that map those four corners of srcRoi (clockwise from the
 * top left) to quad[0] .. quad[3].  The quad must be convex with no three
 * points on a line (the cross products of consecutive edges of one strict
 * sign; either orientation, so mirror images are fine).  Affine takes its
 * coefficients from the first three corners; the fourth must land within
 * 1e-9 of the quad's extent (its larger side of the bounding box) of
 * quad[3] in each coordinate.  Perspective coefficients are scaled so that the denominator
 * is 1 at the top-left corner.  Checks: null quad or coeffs -8, ROI
 * dimension below 1 -6, a ROI dimension of 1, a non-finite quad, a quad
 * that breaks the rules above: -5; nothing is written on failure. */
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpAffine_8u_C1R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][3], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpAffine_8u_C3R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][3], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpAffine_8u_C4R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][3], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpAffine_32f_C1R,
       (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][3], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpAffine_32f_C3R,
       (const float* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, float* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][3], int interpolation))
ZOR_FN(ZOR_GENERIC, Status, zoriGetAffineBound, (ImageRect srcRoi, double bound[2][2], const double coeffs[2][3]))
ZOR_FN(ZOR_GENERIC, Status, zoriGetAffineTransform,
       (ImageRect srcRoi, const double quad[4][2], double coeffs[2][3]))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpBilinear_8u_C1R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][4], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpBilinear_8u_C3R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[2][4], int interpolation))
ZOR_FN(ZOR_GENERIC, Status, zoriGetBilinearTransform,
       (ImageRect srcRoi, const double quad[4][2], double coeffs[2][4]))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpPerspective_8u_C1R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[3][3], int interpolation))
ZOR_FN(ZOR_SSE2UP, Status, zoriWarpPerspective_8u_C3R,
       (const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst, int dstStep,
        ImageRect dstRoi, const double coeffs[3][3], int interpolation))
ZOR_FN(ZOR_GENERIC, Status, zoriGetPerspectiveTransform,
       (ImageRect srcRoi, const double quad[4][2], double coeffs[3][3]))

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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterBox_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
        ImagePoint anchor))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterBox_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, ImageSize maskSize,
        ImagePoint anchor))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterGauss_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterGauss_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterLowpass_8u_C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize dstRoiSize, int mask))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriFilterHipass_8u_C1R,
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriRGBToYCbCr_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriYCbCrToRGB_8u_C3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriRGBToHSV_8u_C3R,
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
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriBGRToYCbCr420_8u_C3P3R,
       (const uint8_t* pSrc, int srcStep, uint8_t* const pDst[3], const int dstStep[3], ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP, Status, zoriYCbCr420ToBGR_8u_P3C3R,
       (const uint8_t* const pSrc[3], const int srcStep[3], uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriRGBToGray_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriColorToGray_8u_C3C1R,
       (const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize, const float coeffs[3]))
ZOR_FN(ZOR_SSE2UP_WIDE, Status, zoriColorToGray_8u_AC4C1R,
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
