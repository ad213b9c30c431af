// Pixel arithmetic and logic: scaled 8-bit sums, differences and products,
// float arithmetic, bitwise logic, thresholds, comparisons, Porter-Duff
// alpha composition and the triangle deinterlacing filter.
//
// Every function checks null pointers, then the ROI size, then every step,
// then its own argument, and writes nothing when a check fails.  The 8-bit
// functions are integer work: the SSE variant shares the generic entries.
// The rules of each function are listed with its rows in the manifest.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "frame/status.h"
#include "image/pixel/arith_kernels.h"

#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

template <class S, class D>
Status checkImages(const S* src, int srcStep, const D* dst, int dstStep, ImageSize roi) {
    return checkFirst(anyNull(src, dst), badRoi(roi), badSteps(srcStep, dstStep));
}
template <class S, class D>
Status checkImages(const S* src1, int src1Step, const S* src2, int src2Step, const D* dst, int dstStep,
                   ImageSize roi) {
    return checkFirst(anyNull(src1, src2, dst), badRoi(roi), badSteps(src1Step, src2Step, dstStep));
}

// f(relation) with the relation of cmpOp as a generic lambda (plain lanes
// and registers); StatusBadArgument for an unknown code.
template <class F>
Status withRelation(int cmpOp, F f) {
    switch (cmpOp) {
    case CmpLess: f([](auto a, auto b) { return simd::lt(a, b); }); break;
    case CmpLessEq: f([](auto a, auto b) { return simd::le(a, b); }); break;
    case CmpEq: f([](auto a, auto b) { return simd::eq(a, b); }); break;
    case CmpGreaterEq: f([](auto a, auto b) { return simd::ge(a, b); }); break;
    case CmpGreater: f([](auto a, auto b) { return simd::gt(a, b); }); break;
    default: return StatusBadArgument;
    }
    return StatusOk;
}

// f(std::integral_constant<int, alphaType>); StatusBadArgument for an
// unknown type.
template <class F>
Status withAlphaType(int alphaType, F f) {
    switch (alphaType) {
    case AlphaOver: f(std::integral_constant<int, AlphaOver>{}); break;
    case AlphaIn: f(std::integral_constant<int, AlphaIn>{}); break;
    case AlphaOut: f(std::integral_constant<int, AlphaOut>{}); break;
    case AlphaATop: f(std::integral_constant<int, AlphaATop>{}); break;
    case AlphaXor: f(std::integral_constant<int, AlphaXor>{}); break;
    case AlphaPlus: f(std::integral_constant<int, AlphaPlus>{}); break;
    default: return StatusBadArgument;
    }
    return StatusOk;
}

}  // namespace

// ---- 8-bit arithmetic -----------------------------------------------------------------
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

namespace {
// The two-source scaled forms: `unscaled` on bytes for a scale factor of 0,
// else `exact` (the integer result in 16-bit lanes) scaled.
template <class Unscaled, class Exact>
Status scaledPair(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst,
                  int dstStep, ImageSize roiSize, int scaleFactor, Unscaled unscaled, Exact exact) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    const Plane s1{pSrc1, src1Step}, s2{pSrc2, src2Step};
    const Plane d{pDst, dstStep};
    if (scaleFactor == 0) mapImage(roiSize, unscaled, s1, s2, d);
    else mapScaled(roiSize, scaleFactor, exact, s1, s2, d);
    return StatusOk;
}
}  // namespace

Status ZOR_CALL zoriAdd_8u_C1RSfs(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                  uint8_t* pDst, int dstStep, ImageSize roiSize, int scaleFactor) {
    return scaledPair(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, scaleFactor,
                      [](auto a, auto b) { return simd::addSat(a, b); }, [](auto a, auto b) { return a + b; });
}

// src2 - src1: negative differences scale to 0 or below and saturate to 0,
// so the difference is taken with a floor of 0 first.
Status ZOR_CALL zoriSub_8u_C1RSfs(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                  uint8_t* pDst, int dstStep, ImageSize roiSize, int scaleFactor) {
    return scaledPair(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, scaleFactor,
                      [](auto a, auto b) { return simd::subSat(b, a); },
                      [](auto a, auto b) { return b - simd::min(a, b); });
}

Status ZOR_CALL zoriMul_8u_C1RSfs(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                  uint8_t* pDst, int dstStep, ImageSize roiSize, int scaleFactor) {
    const auto product = [](auto a, auto b) { return a * b; };
    return scaledPair(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, scaleFactor, inWords(product),
                      product);
}

// A constant of 0 or a scale above 16 leaves nothing but 0 (the source is not
// read); below -7 every non-zero product saturates.
Status ZOR_CALL zoriMulC_8u_C1RSfs(const uint8_t* pSrc, int srcStep, uint8_t value, uint8_t* pDst, int dstStep,
                                   ImageSize roiSize, int scaleFactor) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    const Plane src{pSrc, srcStep};
    const Plane d{pDst, dstStep};
    if (value == 0 || scaleFactor > 16) {
        fillImage(roiSize, d, 0);
    } else if (scaleFactor < -7) {
        mapImage(roiSize, [](auto a) {
            using V = decltype(a);
            return simd::asLanes<V>(simd::gt(a, simd::set1<V>(0)));
        }, src, d);
    } else {
        mapScaled(roiSize, scaleFactor, [value](auto a) { return a * simd::set1<decltype(a)>(value); }, src, d);
    }
    return StatusOk;
}

Status ZOR_CALL zoriAbsDiff_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                   uint8_t* pDst, int dstStep, ImageSize roiSize) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    mapImage(roiSize, [](auto a, auto b) { return simd::absDiff(a, b); }, Plane{pSrc1, src1Step},
             Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    return StatusOk;
}

// ---- logic ---------------------------------------------------------------------------------

namespace {
template <class Op>
Status logic(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step, uint8_t* pDst, int dstStep,
             ImageSize roiSize, Op op) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    mapImage(roiSize, op, Plane{pSrc1, src1Step}, Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    return StatusOk;
}
}  // namespace

Status ZOR_CALL zoriAnd_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                               uint8_t* pDst, int dstStep, ImageSize roiSize) {
    return logic(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize,
                 [](auto a, auto b) { return decltype(a)(a & b); });
}
Status ZOR_CALL zoriOr_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                              uint8_t* pDst, int dstStep, ImageSize roiSize) {
    return logic(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize,
                 [](auto a, auto b) { return decltype(a)(a | b); });
}
Status ZOR_CALL zoriXor_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                               uint8_t* pDst, int dstStep, ImageSize roiSize) {
    return logic(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize,
                 [](auto a, auto b) { return decltype(a)(a ^ b); });
}
Status ZOR_CALL zoriNot_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, ImageSize roiSize) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    mapImage(roiSize, [](auto a) { return decltype(a)(~a); }, Plane{pSrc, srcStep}, Plane{pDst, dstStep});
    return StatusOk;
}

// ---- thresholds and comparisons ---------------------------------------------------------

Status ZOR_CALL zoriThreshold_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize roiSize, uint8_t threshold, int relOp) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    if (relOp != CmpLess && relOp != CmpGreater) return StatusBadArgument;
    const bool raise = relOp == CmpLess;
    mapImage(roiSize, [raise, threshold](auto a) {
        const auto t = simd::set1<decltype(a)>(threshold);
        return raise ? simd::max(a, t) : simd::min(a, t);
    }, Plane{pSrc, srcStep}, Plane{pDst, dstStep});
    return StatusOk;
}

Status ZOR_CALL zoriThreshold_LTValGTVal_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                                ImageSize roiSize, uint8_t thresholdLT, uint8_t valueLT,
                                                uint8_t thresholdGT, uint8_t valueGT) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    if (thresholdLT > thresholdGT) return StatusBadArgument;
    mapImage(roiSize, [=](auto a) {
        using V = decltype(a);
        const V lowered = simd::select(simd::gt(a, simd::set1<V>(thresholdGT)), simd::set1<V>(valueGT), a);
        return simd::select(simd::lt(a, simd::set1<V>(thresholdLT)), simd::set1<V>(valueLT), lowered);
    }, Plane{pSrc, srcStep}, Plane{pDst, dstStep});
    return StatusOk;
}

Status ZOR_CALL zoriCompare_8u_C1R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                   uint8_t* pDst, int dstStep, ImageSize roiSize, int cmpOp) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    return withRelation(cmpOp, [&](auto holds) {
        mapImage(roiSize, [holds](auto a, auto b) { return simd::asLanes<decltype(a)>(holds(a, b)); },
                 Plane{pSrc1, src1Step}, Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    });
}

Status ZOR_CALL zoriCompareC_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t value, uint8_t* pDst, int dstStep,
                                    ImageSize roiSize, int cmpOp) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    return withRelation(cmpOp, [&](auto holds) {
        mapImage(roiSize, [holds, value](auto a) {
            using V = decltype(a);
            return simd::asLanes<V>(holds(a, simd::set1<V>(value)));
        }, Plane{pSrc, srcStep}, Plane{pDst, dstStep});
    });
}

// ---- alpha composition and deinterlacing ------------------------------------------------

Status ZOR_CALL zoriAlphaComp_8u_AC4R(const uint8_t* pSrc1, int src1Step, const uint8_t* pSrc2, int src2Step,
                                      uint8_t* pDst, int dstStep, ImageSize roiSize, int alphaType) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    return withAlphaType(alphaType, [&](auto type) {
        forRows(roiSize, 4, [](const uint8_t* s1, const uint8_t* s2, uint8_t* d, ptrdiff_t n) {
            composeRowAC4<decltype(type)::value>(s1, s2, d, n / 4);
        }, Plane{pSrc1, src1Step}, Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    });
}

Status ZOR_CALL zoriAlphaCompC_8u_C1R(const uint8_t* pSrc1, int src1Step, uint8_t alpha1, const uint8_t* pSrc2,
                                      int src2Step, uint8_t alpha2, uint8_t* pDst, int dstStep, ImageSize roiSize,
                                      int alphaType) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    return withAlphaType(alphaType, [&](auto type) {
        forRows(roiSize, 1, [&](const uint8_t* s1, const uint8_t* s2, uint8_t* d, ptrdiff_t n) {
            composeRowC1<decltype(type)::value>(s1, s2, d, n, alpha1, alpha2);
        }, Plane{pSrc1, src1Step}, Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    });
}

// Reads rows y - 1, y and y + 1 of the source for row y of the destination
// (the edge rows stand in outside the ROI); the destination must not overlap
// the source.
Status ZOR_CALL zoriDeinterlaceFilterTriangle_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                                     ImageSize roiSize, uint32_t centerWeight, uint32_t layout) {
    if (Status s = checkImages(pSrc, srcStep, pDst, dstStep, roiSize)) return s;
    if (centerWeight > 256 || layout != 0) return StatusBadArgument;
    const int last = roiSize.height - 1;
    for (int y = 0; y <= last; ++y)
        deinterlaceRow(rowAt(pSrc, srcStep, y > 0 ? y - 1 : 0), rowAt(pSrc, srcStep, y),
                       rowAt(pSrc, srcStep, y < last ? y + 1 : last), rowAt(pDst, dstStep, y), roiSize.width,
                       int(centerWeight));
    return StatusOk;
}

#endif  // ZOR_SSE2UP entries

// ---- float arithmetic -------------------------------------------------------------------
// One float operation per element: the x87 variants give the same bits as
// SSE at double precision (a product of floats is exact in 53 bits).

namespace {
template <class Op>
Status floatOp(const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst, int dstStep,
               ImageSize roiSize, Op op) {
    if (Status s = checkImages(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize)) return s;
    DoublePrecisionScope precision;
    mapImage(roiSize, op, Plane{pSrc1, src1Step}, Plane{pSrc2, src2Step}, Plane{pDst, dstStep});
    return StatusOk;
}
}  // namespace

Status ZOR_CALL zoriAdd_32f_C1R(const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst,
                                int dstStep, ImageSize roiSize) {
    return floatOp(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, [](auto a, auto b) { return a + b; });
}
Status ZOR_CALL zoriSub_32f_C1R(const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst,
                                int dstStep, ImageSize roiSize) {
    return floatOp(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, [](auto a, auto b) { return b - a; });
}
Status ZOR_CALL zoriMul_32f_C1R(const float* pSrc1, int src1Step, const float* pSrc2, int src2Step, float* pDst,
                                int dstStep, ImageSize roiSize) {
    return floatOp(pSrc1, src1Step, pSrc2, src2Step, pDst, dstStep, roiSize, [](auto a, auto b) { return a * b; });
}

}}  // namespace zor::ZOR_NS
