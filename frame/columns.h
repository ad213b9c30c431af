// Column maps of the manifest: which variant's entry fills each of the five
// dispatch columns (generic, SSE, SSE2, SSE3, SSSE3) of an export's row.
//
//   ZOR_ALL      each variant has its own entry
//   ZOR_GENERIC  the generic entry serves every processor
//   ZOR_SSE2UP   the generic entry also serves the SSE column (integer-only
//                work that gains nothing from SSE1)
#pragma once

#define ZOR_ALL 0, 1, 2, 3, 4
#define ZOR_GENERIC 0, 0, 0, 0, 0
#define ZOR_SSE2UP 0, 0, 2, 3, 4

#define ZOR_COLUMN_0_(a, b, c, d, e) a
#define ZOR_COLUMN_1_(a, b, c, d, e) b
#define ZOR_COLUMN_2_(a, b, c, d, e) c
#define ZOR_COLUMN_3_(a, b, c, d, e) d
#define ZOR_COLUMN_4_(a, b, c, d, e) e
#define ZOR_COLUMN_X_(k, ...) ZOR_COLUMN_##k##_(__VA_ARGS__)
// The variant whose entry fills column k of a map (ZOR_COLUMN(k, ZOR_ALL)).
#define ZOR_COLUMN(k, ...) ZOR_COLUMN_X_(k, __VA_ARGS__)
