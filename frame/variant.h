// Included first by every family source.  A family source is compiled once
// per code variant with -DZOR_VARIANT=k and that variant's instruction-set
// flags; everything it defines lands in namespace zor::vK, and the
// declarations below make the compiler check each entry against the manifest.
//
//   ZOR_VARIANT 0  generic x86: no SIMD at all
//               1  SSE   (float SIMD only)
//               2  SSE2  (integer and double SIMD)
//               3  SSE3
//               4  SSSE3
//               5  AVX2 with FMA (x86-64 only; wide families only)
//               6  AVX-512 F/BW/DQ/VL (x86-64 only; wide families only)
//
// Code selects its paths with `#if ZOR_SIMD >= n`, never with the compiler's
// own __SSE2__ (which x86-64 always defines, also for the generic variant).
// The wide columns have everything of SSSE3 (ZOR_SIMD is 4 there) and
// registers of ZOR_WIDTH bytes: simd::Vec<T> is that wide, so kernels that
// name no width run on the wide registers, and those that name Vec<T, 16>
// stay as they are.
#pragma once

#ifndef ZOR_VARIANT
#  error "family sources are compiled with -DZOR_VARIANT=0..4"
#endif

#include "zor.h"

#if ZOR_VARIANT == 0
#  define ZOR_NS v0
#elif ZOR_VARIANT == 1
#  define ZOR_NS v1
#elif ZOR_VARIANT == 2
#  define ZOR_NS v2
#elif ZOR_VARIANT == 3
#  define ZOR_NS v3
#elif ZOR_VARIANT == 4
#  define ZOR_NS v4
#elif ZOR_VARIANT == 5 && defined(__x86_64__)
#  define ZOR_NS v5
#elif ZOR_VARIANT == 6 && defined(__x86_64__)
#  define ZOR_NS v6
#else
#  error "ZOR_VARIANT out of range"
#endif

#if ZOR_VARIANT >= 5
#  define ZOR_SIMD 4
#  define ZOR_WIDTH (ZOR_VARIANT == 5 ? 32 : 64)
// (GCC 12 warns about the deliberately undefined upper lanes inside some
// AVX-512 intrinsics wherever they are inlined: silenced for the header)
#  pragma GCC diagnostic push
#  pragma GCC diagnostic ignored "-Wuninitialized"
#  pragma GCC diagnostic ignored "-Wmaybe-uninitialized"
#  include <immintrin.h>
#  pragma GCC diagnostic pop
#else
#  define ZOR_SIMD ZOR_VARIANT
#  define ZOR_WIDTH 16
#endif

#if ZOR_SIMD >= 1
#  include <xmmintrin.h>
#endif
#if ZOR_SIMD >= 2
#  include <emmintrin.h>
#endif
#if ZOR_SIMD >= 3
#  include <pmmintrin.h>
#endif
#if ZOR_SIMD >= 4
#  include <tmmintrin.h>
#endif

#include "frame/columns.h"

// True when this variant compiles the entries of the rows whose map is
// `map`: every variant for ZOR_ALL, only the generic one for ZOR_GENERIC,
// all but SSE for ZOR_SSE2UP (the SSE column borrows the generic entry).
// Wrap a family's entries of such rows in #if ZOR_DEFINES_ENTRIES_OF(map).
// A wide column compiles what the SSSE3 column compiles; the manifest's
// wide maps pick the entries it serves, the others stay unused.
#if ZOR_VARIANT >= 5
#  define ZOR_DEFINES_ENTRIES_OF(map) (ZOR_COLUMN(4, map) == 4)
#else
#  define ZOR_DEFINES_ENTRIES_OF(map) (ZOR_COLUMN(ZOR_VARIANT, map) == ZOR_VARIANT)
#endif

#define ZOR_ENTRY_NS ZOR_NS
#include "frame/entries.h"
