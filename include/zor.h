/*
 * zor: performance primitives for signals (zors*), images (zori*) and small
 * matrices (zorm*), behind a flat C interface.
 *
 * Every function returns a Status (0 success, negative error, positive
 * warning) except the allocators (pointer or null), the free functions and
 * the version getters.  Arguments are checked before any output is touched;
 * on an error nothing is written.
 *
 * On 32-bit Windows every export uses the standard-call convention
 * (ZOR_CALL); elsewhere the platform's default C convention.
 *
 * This header is valid C (C99 or later) and C++.
 */
#ifndef ZOR_H
#define ZOR_H

#include <stddef.h>
#include <stdint.h>

#if defined(_WIN32) && !defined(_WIN64)
#  define ZOR_CALL __stdcall
#else
#  define ZOR_CALL
#endif

#if defined(_WIN32)
#  define ZOR_API
#elif defined(__GNUC__)
#  define ZOR_API __attribute__((visibility("default")))
#else
#  define ZOR_API
#endif

#ifdef __cplusplus
extern "C" {
#endif

/* ---- Status codes --------------------------------------------------- */

typedef int32_t Status;

enum {
    StatusOk                   = 0,

    /* errors */
    StatusBadArgument          = -5,
    StatusBadSize              = -6,
    StatusNullPointer          = -8,
    StatusNoMemory             = -9,
    StatusDivideByZero         = -10,
    StatusOutOfRange           = -11,
    StatusBadScaleFactor       = -13,
    StatusBadStep              = -14,
    StatusBadOrder             = -15,
    StatusBadFlag              = -16,
    StatusContextMismatch      = -17,
    StatusBadFlip              = -21,
    StatusBadInterpolation     = -22,
    StatusBadResizeFactor      = -23,
    StatusBadFilterOrder       = -25,
    StatusBadMaskSize          = -33,
    StatusBadAnchor            = -34,
    StatusStepBelowRow         = -37,
    StatusBadChannelIndex      = -47,
    StatusBadDivisor           = -51,
    StatusBadChannelOfInterest = -52,
    StatusBadChannelCount      = -53,
    StatusZeroMask             = -59,
    StatusChannelOrder         = -60,
    StatusBankNotReady         = -69,
    StatusBadMelMode           = -70,
    StatusBadFrequencyRange    = -71,
    StatusBadLevelCount        = -107,
    StatusNotEvenStep          = -108,
    StatusBadStride            = -182,
    StatusBadMatrixShape       = -204,

    /* warnings: the work was done, a special condition is reported */
    StatusWarnMisaligned       = 2,
    StatusWarnSqrtNegative     = 3,
    StatusWarnDivByZero        = 6,
    StatusWarnLnZero           = 7,
    StatusWarnLnNegative       = 8,
    StatusWarnNoOperation      = 29,
    StatusWarnOddSize          = 35
};

/* ---- Shared records ------------------------------------------------- */

typedef struct ImageSize  { int32_t width; int32_t height; } ImageSize;
typedef struct ImageRect  { int32_t x; int32_t y; int32_t width; int32_t height; } ImageRect;
typedef struct ImagePoint { int32_t x; int32_t y; } ImagePoint;

typedef struct Complex16s { int16_t re; int16_t im; } Complex16s;
typedef struct Complex32s { int32_t re; int32_t im; } Complex32s;
typedef struct Complex32f { float   re; float   im; } Complex32f;
typedef struct Complex64s { int64_t re; int64_t im; } Complex64s;
typedef struct Complex64f { double  re; double  im; } Complex64f;
/* 8-bit complex elements are only allocated, never computed on. */
typedef struct Complex8s  { int8_t  re; int8_t  im; } Complex8s;

/* Version of the code variant bound at load. */
typedef struct LibraryVersion {
    int32_t     major;        /* 5 */
    int32_t     minor;        /* 2 */
    int32_t     buildSeries;  /* 108 */
    int32_t     build;        /* 412 signal half, 410 image half */
    char        cpuTag[4];    /* "g0", "s1", "s2", "s3" or "s4", NUL-padded */
    const char* libraryName;  /* e.g. "zorss4l.lib" */
    const char* versionText;  /* "5.2" */
    const char* buildDate;    /* "Apr  5 2007" */
} LibraryVersion;

/* Code variants, in the order of the tags above. */
enum {
    VariantGeneric = 0,
    VariantSse     = 1,
    VariantSse2    = 2,
    VariantSse3    = 3,
    VariantSsse3   = 4
};

/* Interpolation codes. */
enum {
    InterNearest = 1,
    InterLinear  = 2,
    InterCubic   = 4,
    InterSuper   = 8,
    InterLanczos = 16   /* resize only: 3 lobes, 6 x 6 taps */
};

/* Mask codes: tens digit is the width, units digit the height. */
enum {
    MaskSize3x3 = 33,
    MaskSize5x5 = 55
};

/* Rounding modes of the float-to-integer signal conversions: any value
   other than RoundNear truncates toward zero. */
enum {
    RoundZero = 0,
    RoundNear = 1
};

/* Relation codes.  zorsThreshold_32f_I: CmpGreater clips from above, any
   other value from below.  zoriThreshold_8u_C1R takes CmpLess and CmpGreater;
   zoriCompare_8u_C1R and zoriCompareC_8u_C1R take all five. */
enum {
    CmpLess      = 0,
    CmpLessEq    = 1,
    CmpEq        = 2,
    CmpGreaterEq = 3,
    CmpGreater   = 4
};

/* Porter-Duff operations of zoriAlphaComp_8u_AC4R and zoriAlphaCompC_8u_C1R
   (image A is the first source, B the second). */
enum {
    AlphaOver = 0,  /* A over B */
    AlphaIn   = 1,  /* A inside B */
    AlphaOut  = 2,  /* A outside B */
    AlphaATop = 3,  /* A atop B */
    AlphaXor  = 4,  /* A xor B */
    AlphaPlus = 5   /* A plus B, saturated */
};

/* Flood fill: the region filled (zoriFloodFill_*). */
typedef struct ConnectedComp {
    double    area;      /* number of pixels filled */
    double    value[3];  /* newVal, 0, 0 */
    ImageRect rect;      /* bounding box of the filled pixels */
} ConnectedComp;

/* Moment state (zoriMomentInitAlloc_64f ... zoriGetSpatialMoment_64f):
   created by zoriMomentInitAlloc_64f, filled by zoriMoments64f_32f_C1R,
   released by zoriMomentFree_64f.  moments[c][m + 4 n] holds the moment of
   x-order m and y-order n of channel c (m + n <= 3). */
enum { MomentStateId = 33 };
typedef struct MomentState {
    int32_t id;        /* MomentStateId */
    int32_t hint;      /* accuracy hint given at creation, kept only */
    int32_t channels;  /* -1 until moments are computed, then 1 */
    int32_t reserved;
    double  moments[3][16];
} MomentState;

/* ---- Exported functions -------------------------------------------- */

#define ZOR_FN(map, ret, name, params) ZOR_API ret ZOR_CALL name params;
#include "zor_manifest.h"
#undef ZOR_FN

#ifdef __cplusplus
} /* extern "C" */
#endif

#endif /* ZOR_H */
