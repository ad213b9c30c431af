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
