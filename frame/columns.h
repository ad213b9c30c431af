// Column maps of the manifest: which variant's entry fills each dispatch
// column of an export's row: generic, SSE, SSE2, SSE3, SSSE3, and on x86-64
// the wide columns AVX2 (256-bit) and AVX-512 (512-bit).
//
//   ZOR_ALL         each variant has its own entry; the wide columns take
//                   the SSSE3 one
//   ZOR_GENERIC     the generic entry serves every processor
//   ZOR_SSE2UP      the generic entry also serves the SSE column (integer-only
//                   work that gains nothing from SSE1)
//   ZOR_WIDE        ZOR_ALL with entries of their own in the wide columns
//   ZOR_SSE2UP_WIDE ZOR_SSE2UP with entries of their own in the wide columns
//
// A row with a wide map needs its family compiled for the wide columns
// (zor_add_family(<source> WIDE) in CMakeLists.txt); its wide entries give
// the SSSE3 entry's results bit for bit.  The 32-bit build has five columns
// and ignores the last two.
#pragma once

#define ZOR_ALL 0, 1, 2, 3, 4, 4, 4
#define ZOR_GENERIC 0, 0, 0, 0, 0, 0, 0
#define ZOR_SSE2UP 0, 0, 2, 3, 4, 4, 4
#define ZOR_WIDE 0, 1, 2, 3, 4, 5, 6
#define ZOR_SSE2UP_WIDE 0, 0, 2, 3, 4, 5, 6

#define ZOR_COLUMN_0_(a, b, c, d, e, f, g) a
#define ZOR_COLUMN_1_(a, b, c, d, e, f, g) b
#define ZOR_COLUMN_2_(a, b, c, d, e, f, g) c
#define ZOR_COLUMN_3_(a, b, c, d, e, f, g) d
#define ZOR_COLUMN_4_(a, b, c, d, e, f, g) e
#define ZOR_COLUMN_5_(a, b, c, d, e, f, g) f
#define ZOR_COLUMN_6_(a, b, c, d, e, f, g) g
#define ZOR_COLUMN_X_(k, ...) ZOR_COLUMN_##k##_(__VA_ARGS__)
// The variant whose entry fills column k of a map (ZOR_COLUMN(k, ZOR_ALL)).
#define ZOR_COLUMN(k, ...) ZOR_COLUMN_X_(k, __VA_ARGS__)
