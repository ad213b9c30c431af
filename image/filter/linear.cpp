// Linear filters with a caller-supplied kernel: true convolution (the kernel
// is flipped in both axes), no border handling (every source pixel that the
// flipped kernel covers must exist around the ROI), and an anchor that is
// deliberately not validated: any anchor only moves the neighbourhood.
//
// Integer kernels (8u): sums wrap in 32 bits, then the divisor is applied in
// one of three modes (1: none; a power of two: shift with half-up rounding;
// anything else: multiply by the float reciprocal, exactly, half up).  Every
// non-positive quotient yields 0.
//
// Float kernels: the sum is accumulated in double in neighbourhood order (top
// row first, left to right), then rounded half up (8u, NaN to 0) or half away
// from zero (16s, NaN to 0) and saturated.
//
// The 16s integer form scales the kernel by the float reciprocal of the
// divisor and runs the float-kernel 16s filter.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"
#include "image/filter/linear_kernels.h"

#include <cstddef>
#include <cstdint>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

// ---- geometry -----------------------------------------------------------------

// Walking the neighbourhood from its top-left pixel with the kernel reversed
// is the same as convolving with the kernel: tap (r, q) of the walk (row r
// from the top, column q from the left) takes coefficient
// K[kH-1-r][kW-1-q].
struct Walk {
    ptrdiff_t left;  // samples from the ROI pixel back to the neighbourhood's left column
    ptrdiff_t up;    // rows from the ROI row up to the neighbourhood's top row
};

inline Walk walkOf(ImageSize kernelSize, ImagePoint anchor, int channels) {
    return {(static_cast<ptrdiff_t>(kernelSize.width) - 1 - anchor.x) * channels,
            static_cast<ptrdiff_t>(kernelSize.height) - 1 - anchor.y};
}

inline int64_t rowSamples(int width, int kernelWidth, int channels) {
    return (static_cast<int64_t>(width) + kernelWidth - 1) * channels;
}

#if ZOR_SIMD >= 2
// Calls f with the register width in bytes for rows of n lanes of type Lane:
// the column's own where one register of them fits in the row, 16 bytes
// otherwise (the wide columns' registers outgrow short rows).  One call
// site in the 16-byte columns, so that f is inlined there as before.
template <class Lane, class F>
void atWidthFor(int n, F&& f) {
    if constexpr (simd::kNativeBytes == 16) f(std::integral_constant<int, 16>{});
    else if (n >= simd::Vec<Lane>::kLanes) f(std::integral_constant<int, simd::kNativeBytes>{});
    else f(std::integral_constant<int, 16>{});
}
#endif

// ---- checks ----------------------------------------------------------------------

// Steps that cannot hold a source row of (width + kW - 1) samples or a
// destination row of width samples.
Status badFilterSteps(int srcStep, int dstStep, ImageSize roi, ImageSize ks, int channels,
                      int sampleBytes) {
    if (srcStep < rowSamples(roi.width, ks.width, channels) * sampleBytes ||
        dstStep < static_cast<int64_t>(roi.width) * channels * sampleBytes)
        return StatusBadStep;
    return StatusOk;
}

Status badSizes(ImageSize roi, ImageSize ks) {
    return (roi.width <= 0 || roi.height <= 0 || ks.width <= 0 || ks.height <= 0)
               ? StatusBadSize
               : StatusOk;
}

// ---- the filters: checks, then the fastest kernel that takes the arguments ----------

Status filterInt8u(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi,
                   const int32_t* kernel, ImageSize ks, ImagePoint anchor, int divisor,
                   int channels) {
    if (Status s = checkFirst(anyNull(src, dst, kernel), badSizes(roi, ks),
                              divisor == 0 ? StatusBadDivisor : StatusOk,
                              badFilterSteps(srcStep, dstStep, roi, ks, channels, 1)))
        return s;
    const DivisorScaling d = divisorScaling(divisor);
    const Walk walk = walkOf(ks, anchor, channels);
    const int samples = roi.width * channels;
    const uint8_t* top = rowAt(src, srcStep, -walk.up) - walk.left;
#if ZOR_SIMD >= 4
    if (samples >= 16) {
        ByteKernel bytes(kernel, ks);
        if (bytes.ok()) {
            const Scale16 scale(d, bytes.absMax());
            if (scale.ok()) {
                PairRows pairs(ks.height, rowSamples(roi.width, ks.width, channels), channels);
                atWidthFor<uint8_t>(samples, [&](auto width) {
                    constexpr int B = decltype(width)::value, L = B;  // byte lanes
                    for (int y = 0; y < roi.height; ++y) {
                        const uint8_t* t = rowAt(top, srcStep, y);
                        uint8_t* o = rowAt(dst, dstStep, y);
                        if (pairs.ok()) {
                            bytes.pairedRow<B>(pairs.advance(t, srcStep, y), o, samples, channels, scale);
                            continue;
                        }
                        for (int x0 = 0; x0 < samples; x0 += L) {
                            const int x = x0 + L <= samples ? x0 : samples - L;  // last block overlaps
                            I16s<B> lo, hi;
                            bytes.sums<B>(t, srcStep, x, channels, lo, hi);
                            simd::store(o + x, scale.template apply<false>(lo, hi));
                        }
                    }
                });
                return StatusOk;
            }
        }
    }
#endif
#if ZOR_SIMD >= 2
    if (samples >= 16) {
        IntKernelTable table(kernel, ks);
        if (table.ok()) {
            // largest possible |sum|, for the exactness of the double path
            int64_t absSum = 0;
            for (int i = 0; i < ks.width * ks.height; ++i)
                absSum += 255 * static_cast<int64_t>(kernel[i] < 0 ? -int64_t(kernel[i]) : kernel[i]);
            const bool doubleExact = d.mode == 2 && absSum < (int64_t(1) << 29) && d.exp <= 44;
            atWidthFor<uint8_t>(samples, [&](auto width) {
                for (int y = 0; y < roi.height; ++y)
                    intRows8uSimd<decltype(width)::value>(table, rowAt(top, srcStep, y), srcStep,
                                                          rowAt(dst, dstStep, y), samples, kernel, ks,
                                                          channels, d, doubleExact);
            });
            return StatusOk;
        }
    }
#endif
    for (int y = 0; y < roi.height; ++y)
        intRow8u(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), 0, samples, kernel, ks,
                 channels, d);
    return StatusOk;
}

template <class T>
Status filterFloat(const T* src, int srcStep, T* dst, int dstStep, ImageSize roi,
                   const float* kernel, ImageSize ks, ImagePoint anchor, int channels) {
    if (Status s = checkFirst(anyNull(src, dst, kernel), badSizes(roi, ks),
                              badFilterSteps(srcStep, dstStep, roi, ks, channels, sizeof(T))))
        return s;
    DoublePrecisionScope precision;
    const Walk walk = walkOf(ks, anchor, channels);
    const int samples = roi.width * channels;
    const T* top = rowAt(src, srcStep, -walk.up) - walk.left;
#if ZOR_SIMD >= 2
    if constexpr (sizeof(T) == 1) {
        GridFloatKernel grid(kernel, ks, channels, samples);
        if (grid.ok()) {
            atWidthFor<uint8_t>(samples, [&](auto width) {
                for (int y = 0; y < roi.height; ++y)
                    grid.row<decltype(width)::value>(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y),
                                                     kernel);
            });
            return StatusOk;
        }
        if (samples >= 16) {
            ExactFloatKernel exact(kernel, ks);
            if (exact.ok()) {
                atWidthFor<uint8_t>(samples, [&](auto width) {
                    for (int y = 0; y < roi.height; ++y)
                        exact.row<decltype(width)::value>(rowAt(top, srcStep, y), srcStep,
                                                          rowAt(dst, dstStep, y), samples, channels);
                });
                return StatusOk;
            }
        }
    }
    if (samples >= 8) {
        atWidthFor<int16_t>(samples, [&](auto width) {
            for (int y = 0; y < roi.height; ++y)
                doubleRow<decltype(width)::value>(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y),
                                                  samples, kernel, ks, channels);
        });
        return StatusOk;
    }
#endif
    for (int y = 0; y < roi.height; ++y)
        floatRow(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), 0, samples, kernel, ks,
                 channels);
    return StatusOk;
}

}  // namespace

Status ZOR_CALL zoriFilter_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize dstRoiSize, const int32_t* pKernel,
                                  ImageSize kernelSize, ImagePoint anchor, int divisor) {
    return filterInt8u(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor,
                       divisor, 1);
}

Status ZOR_CALL zoriFilter_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize dstRoiSize, const int32_t* pKernel,
                                  ImageSize kernelSize, ImagePoint anchor, int divisor) {
    return filterInt8u(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor,
                       divisor, 3);
}

Status ZOR_CALL zoriFilter32f_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, const float* pKernel,
                                     ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 1);
}

Status ZOR_CALL zoriFilter32f_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, const float* pKernel,
                                     ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 3);
}

Status ZOR_CALL zoriFilter32f_16s_C1R(const int16_t* pSrc, int srcStep, int16_t* pDst,
                                      int dstStep, ImageSize dstRoiSize, const float* pKernel,
                                      ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 1);
}

// Deliberately built on the float-kernel filter: each coefficient becomes
// float(coefficient) * float(1.0 / divisor), rounded to float, so that the
// 16s results follow the float form's rounding (half away from zero).
Status ZOR_CALL zoriFilter_16s_C1R(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                   ImageSize dstRoiSize, const int32_t* pKernel,
                                   ImageSize kernelSize, ImagePoint anchor, int divisor) {
    if (!pKernel) return StatusNullPointer;
    if (kernelSize.width <= 0 || kernelSize.height <= 0) return StatusBadSize;
    if (divisor == 0) return StatusBadDivisor;
    const uint64_t n = static_cast<uint64_t>(kernelSize.width) * static_cast<uint64_t>(kernelSize.height);
    if (n * sizeof(float) > 0xFFFFFF00u) return StatusNoMemory;
    float* scaled = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(n * sizeof(float))));
    if (!scaled) return StatusNoMemory;
    {
        DoublePrecisionScope precision;
        const float f = toFloat(1.0 / static_cast<double>(divisor));
        for (uint64_t i = 0; i < n; ++i)  // float * float is exact in double, then rounded once
            scaled[i] = toFloat(static_cast<double>(toFloat(static_cast<double>(pKernel[i]))) *
                                static_cast<double>(f));
    }
    const Status s = ZOR_NS::zoriFilter32f_16s_C1R(pSrc, srcStep, pDst, dstStep, dstRoiSize, scaled,
                                           kernelSize, anchor);
    mem::alignedFree(scaled);
    return s;
}

}}  // namespace zor::ZOR_NS
