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
//
// Code selects its paths with `#if ZOR_SIMD >= n`, never with the compiler's
// own __SSE2__ (which x86-64 always defines, also for the generic variant).
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
#else
#  error "ZOR_VARIANT out of range"
#endif

#define ZOR_SIMD ZOR_VARIANT

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
#define ZOR_DEFINES_ENTRIES_OF(map) (ZOR_COLUMN(ZOR_VARIANT, map) == ZOR_VARIANT)

#define ZOR_ENTRY_NS ZOR_NS
#include "frame/entries.h"
