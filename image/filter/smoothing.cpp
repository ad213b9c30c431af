// Smoothing filters: box mean (FilterBox, FilterLowpass), the binomial
// Gauss filters, the 3x3 and 5x5 high-pass, the adaptive Wiener filter and
// full two-dimensional convolution.  The rules of each function are listed
// with its rows in the manifest.
//
// Box, low-pass, high-pass and Wiener work on window sums carried from row
// to row and along the row (smoothing_kernels.h), so their time per pixel
// does not depend on the mask.  The sums are exact integers in the
// narrowest lanes that hold them: 16 bits for windows of up to 256 pixels
// (255 * 256 + 128 < 2^16), where the mean comes from a multiply-high and
// one correction, and 32 or 64 bits beyond.
//
// Full convolution sums its terms in a fixed order; the SIMD variants keep
// that order in every lane of a block of outputs, reading a ring of the
// first image's rows padded with zeros.
//
// Every function checks null pointers, then sizes, then steps, then its own
// arguments, and writes nothing when a check fails.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"
#include "image/filter/smoothing_kernels.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <utility>

namespace zor { namespace ZOR_NS {
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP) || ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
namespace {

using namespace smoothing;

// ---- checks and sizes used by every entry -----------------------------------------------------

Status badMask(ImageSize mask) { return mask.width < 1 || mask.height < 1 ? StatusBadMaskSize : StatusOk; }

int64_t pixelsOf(ImageSize mask) { return int64_t(mask.width) * mask.height; }

// Wiener sums stay exact in double up to this many pixels a window
// (N Q < 65025 N^2 < 2^53); larger masks are refused.
constexpr int64_t kWienerMaxPixels = int64_t(1) << 18;

Status badWienerMask(ImageSize mask) {
    return checkFirst(badMask(mask), pixelsOf(mask) > kWienerMaxPixels ? StatusBadMaskSize : StatusOk);
}

constexpr int kBufferAlign = 64;

}  // namespace
#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
namespace {

// ---- checks ----------------------------------------------------------------------------

Status badAnchor(ImageSize mask, ImagePoint anchor) {
    return anchor.x < 0 || anchor.x >= mask.width || anchor.y < 0 || anchor.y >= mask.height ? StatusBadAnchor
                                                                                              : StatusOk;
}

// Side of the square mask named by a mask code, 0 for an unknown code.
int sideOf(int mask) { return mask == MaskSize3x3 ? 3 : mask == MaskSize5x5 ? 5 : 0; }

Status checkNeighbourhood(const uint8_t* src, int srcStep, const uint8_t* dst, int dstStep, ImageSize roi) {
    return checkFirst(anyNull(src, dst), badRoi(roi), badSteps(srcStep, dstStep));
}

// ---- work memory -------------------------------------------------------------------------

template <class T>
class Scratch {
public:
    explicit Scratch(int64_t lanes) {
        if (lanes > 0 && uint64_t(lanes) * sizeof(T) <= 0x7FFFFFFFu)
            p = static_cast<T*>(mem::alignedAlloc(static_cast<uint32_t>(uint64_t(lanes) * sizeof(T))));
    }
    ~Scratch() { mem::alignedFree(p); }
    Scratch(const Scratch&) = delete;
    Scratch& operator=(const Scratch&) = delete;
    T* p = nullptr;
};

// ---- box sums ------------------------------------------------------------------------------

// The neighbourhood of ROI pixel (0, 0) begins here.
const uint8_t* neighbourhoodTop(const uint8_t* src, int srcStep, ImagePoint anchor, int channels) {
    return rowAt(src, srcStep, -anchor.y) - ptrdiff_t(anchor.x) * channels;
}

// finish(y, sums of row y) for every ROI row, sums in lanes of T.
template <class T, class Finish>
Status withBoxSums(const uint8_t* src, int srcStep, ImageSize roi, int channels, ImageSize mask,
                   ImagePoint anchor, Finish finish) {
    const ptrdiff_t outputs = ptrdiff_t(roi.width) * channels;
    Scratch<T> scratch(BoxSums<T, 1>::lanesNeeded(outputs, mask.width, channels));
    if (!scratch.p) return StatusNoMemory;
    BoxSums<T, 1> sums(scratch.p, outputs, mask.width, channels);
    slideBoxes(neighbourhoodTop(src, srcStep, anchor, channels), srcStep, roi.height, mask.height,
               [&](int y) { finish(y, sums.rowSums()); }, sums);
    return StatusOk;
}

// dst = (sum + N/2) / N.
Status boxMean(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi, int channels,
               ImageSize mask, ImagePoint anchor) {
    const int64_t n = pixelsOf(mask);
    const ptrdiff_t outputs = ptrdiff_t(roi.width) * channels;
    if (n <= 256) {
        const BoxMean mean{int(n)};
        return withBoxSums<uint16_t>(src, srcStep, roi, channels, mask, anchor, [&](int y, const uint16_t* h) {
            storeBytes(rowAt(dst, dstStep, y), outputs,
                       [&](auto w, ptrdiff_t i) { return mean(simd::load<decltype(w)>(h + i)); });
        });
    }
    auto scalarMean = [&](int y, const auto* h) {
        uint8_t* d = rowAt(dst, dstStep, y);
        for (ptrdiff_t i = 0; i < outputs; ++i) d[i] = uint8_t((h[i] + uint64_t(n / 2)) / uint64_t(n));
    };
    if (n < (int64_t(1) << 24))  // 255 N + N / 2 < 2^32
        return withBoxSums<uint32_t>(src, srcStep, roi, channels, mask, anchor, scalarMean);
    return withBoxSums<uint64_t>(src, srcStep, roi, channels, mask, anchor, scalarMean);
}

// The centre pixel times the mask area, minus the box sum, saturated.
Status hipass(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi, int side) {
    const ImageSize mask{side, side};
    const ImagePoint anchor{side / 2, side / 2};
    const uint16_t area = uint16_t(side * side);
    return withBoxSums<uint16_t>(src, srcStep, roi, 1, mask, anchor, [&](int y, const uint16_t* h) {
        const uint8_t* centre = rowAt(src, srcStep, y);
        storeBytes(rowAt(dst, dstStep, y), roi.width, [&](auto w, ptrdiff_t i) {
            using W = decltype(w);
            return simd::set1<W>(area) * loadBytesAs<W>(centre + i) - simd::load<W>(h + i);
        });
    });
}

// ---- Gauss ---------------------------------------------------------------------------------

template <int channels>
Status gauss(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi, int mask) {
    if (Status s = checkNeighbourhood(src, srcStep, dst, dstStep, roi)) return s;
    const int side = sideOf(mask);
    if (side == 0) return StatusBadMaskSize;
    const ptrdiff_t outputs = ptrdiff_t(roi.width) * channels;
    Scratch<uint16_t> scratch((side + 1) * (outputs + int64_t(side - 1) * channels));
    if (!scratch.p) return StatusNoMemory;
    const uint8_t* top = neighbourhoodTop(src, srcStep, {side / 2, side / 2}, channels);
    if (side == 3) gaussRows<3, channels>(top, srcStep, roi.height, scratch.p, outputs, dst, dstStep);
    else gaussRows<5, channels>(top, srcStep, roi.height, scratch.p, outputs, dst, dstStep);
    return StatusOk;
}

// ---- Wiener --------------------------------------------------------------------------------

template <class T>
void wiener(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi, ImageSize mask,
            ImagePoint anchor, float* noise, uint8_t* buffer) {
    const ptrdiff_t width = roi.width;
    const ptrdiff_t lanes = BoxSums<T, 1>::lanesNeeded(width, mask.width, 1);
    T* base = reinterpret_cast<T*>((reinterpret_cast<uintptr_t>(buffer) + kBufferAlign - 1) &
                                   ~uintptr_t(kBufferAlign - 1));
    BoxSums<T, 1> sums(base, width, mask.width, 1);
    BoxSums<T, 2> squares(base + lanes, width, mask.width, 1);
    const uint8_t* top = neighbourhoodTop(src, srcStep, anchor, 1);
    const uint64_t n = uint64_t(pixelsOf(mask));
    float noiseFraction = *noise;
    DoublePrecisionScope precision;
    if (noiseFraction == 0.0f) {
        // the mean variance over the ROI: sum of N Q - S^2, exact in 128 bits
        uint64_t lo = 0, hi = 0;
        slideBoxes(top, srcStep, roi.height, mask.height, [&](int) {
            const T* s = sums.rowSums();
            const T* q = squares.rowSums();
            for (ptrdiff_t i = 0; i < width; ++i) {
                const uint64_t d = varianceNumerator(s[i], q[i], n);
                lo += d;
                hi += lo < d;
            }
        }, sums, squares);
        const double total = toDouble(double(hi) * 18446744073709551616.0 + double(lo));
        const double variance = toDouble(toDouble(total / (double(n) * double(n))) / double(pixelsOf(roi)));
        noiseFraction = toFloat(variance / 65025.0);
        *noise = noiseFraction;
    }
    const double noiseN2 = toDouble(double(noiseFraction) * 65025.0 * (double(n) * double(n)));
    slideBoxes(top, srcStep, roi.height, mask.height, [&](int y) {
        wienerRow(sums.rowSums(), squares.rowSums(), rowAt(src, srcStep, y), rowAt(dst, dstStep, y), width,
                  double(n), noiseN2);
    }, sums, squares);
}

// ---- full convolution ----------------------------------------------------------------------------

// Output size, or StatusBadSize when it leaves the int range.
Status fullSize(ImageSize a, ImageSize b, ImageSize& out) {
    const int64_t w = int64_t(a.width) + b.width - 1, h = int64_t(a.height) + b.height - 1;
    if (w > INT_MAX || h > INT_MAX) return StatusBadSize;
    out = {int(w), int(h)};
    return StatusOk;
}

template <class T>
Status checkConv(const T* src1, int step1, ImageSize size1, const T* src2, int step2, ImageSize size2,
                 const T* dst, int dstStep, ImageSize& out) {
    return checkFirst(anyNull(src1, src2, dst), badRoi(size1), badRoi(size2), fullSize(size1, size2, out),
                      badSteps(step1, step2, dstStep));
}

[[maybe_unused]] bool allFinite(const Image<float>& k) {
    for (int j = 0; j < k.size.height; ++j)
        for (int i = 0; i < k.size.width; ++i)
            if (!std::isfinite(k.row(j)[i])) return false;
    return true;
}

// The SIMD row loop over a ring of padded rows of the first image; false
// (nothing written) when the block does not fit or the ring cannot be had.
template <class L, class Row>
bool convRows(ptrdiff_t ringLanes, ImageSize out, int block, Row row) {
    if (out.width < block) return false;
    Scratch<L> ring(ringLanes);
    if (!ring.p) return false;
    for (int y = 0; y < out.height; ++y) row(ring.p, y);
    return true;
}

bool convFloatSimd([[maybe_unused]] const Image<float>& a, [[maybe_unused]] const Image<float>& k,
                   [[maybe_unused]] float* dst, [[maybe_unused]] int dstStep, [[maybe_unused]] ImageSize out) {
#if ZOR_SIMD >= 2
    constexpr int kRegs = 4;
    if (!allFinite(k)) return false;
    const ptrdiff_t pad = k.size.width - 1;
    const PaddedRows<double> shape{nullptr, pad, a.size.width, pad, std::min(a.size.height, k.size.height)};
    return convRows<double>(shape.stride() * shape.count, out, kRegs * simd::Vec<double>::kLanes,
                            [&](double* ring, int y) {
                                const PaddedRows<double> rows{ring, shape.left, shape.width, shape.right, shape.count};
                                if (y < a.size.height) rows.put(a.row(y), y);
                                convRowFloat<kRegs>(rows, k, y, a.size.height, rowAt(dst, dstStep, y), out.width);
                            });
#else
    return false;
#endif
}

bool convBytesSimd([[maybe_unused]] const Image<uint8_t>& a, [[maybe_unused]] const Image<uint8_t>& k,
                   [[maybe_unused]] uint8_t* dst, [[maybe_unused]] int dstStep, [[maybe_unused]] ImageSize out,
                   [[maybe_unused]] int divisor) {
#if ZOR_SIMD >= 2
    // at most 33025 terms of 255 * 255 an output: the sums fit 31 bits
    const int64_t terms = int64_t(std::min(a.size.width, k.size.width)) * std::min(a.size.height, k.size.height);
    if (terms > 33025) return false;
    const int pairCount = (k.size.width + 1) / 2;
    Scratch<int32_t> pairs(int64_t(pairCount) * k.size.height), sums(out.width);
    if (!pairs.p || !sums.p) return false;
    for (int j = 0; j < k.size.height; ++j)
        for (int t = 0; t < pairCount; ++t) {
            const uint8_t* kr = k.row(j);
            const int second = 2 * t + 1 < k.size.width ? kr[2 * t + 1] : 0;
            pairs.p[ptrdiff_t(j) * pairCount + t] = kr[2 * t] | second << 16;
        }
    const PaddedRows<int16_t> shape{nullptr, k.size.width, a.size.width, k.size.width - 1,
                                    std::min(a.size.height, k.size.height)};
    return convRows<int16_t>(shape.stride() * shape.count, out, simd::Vec<int16_t>::kLanes,
                             [&](int16_t* ring, int y) {
                                 const PaddedRows<int16_t> rows{ring, shape.left, shape.width, shape.right,
                                                                shape.count};
                                 if (y < a.size.height) rows.put(a.row(y), y);
                                 convRowBytes(rows, pairs.p, pairCount, k.size, y, a.size.height, sums.p, out.width);
                                 divideRow(sums.p, rowAt(dst, dstStep, y), out.width, divisor);
                             });
#else
    return false;
#endif
}

}  // namespace

// ---- box, low-pass, high-pass -------------------------------------------------------------------

namespace {
Status filterBox(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi, ImageSize mask,
                 ImagePoint anchor, int channels) {
    if (Status s = checkFirst(checkNeighbourhood(src, srcStep, dst, dstStep, roi), badMask(mask),
                              badAnchor(mask, anchor)))
        return s;
    return boxMean(src, srcStep, dst, dstStep, roi, channels, mask, anchor);
}
}  // namespace

Status ZOR_CALL zoriFilterBox_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor) {
    return filterBox(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor, 1);
}

Status ZOR_CALL zoriFilterBox_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor) {
    return filterBox(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor, 3);
}

Status ZOR_CALL zoriFilterLowpass_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                         ImageSize dstRoiSize, int mask) {
    if (Status s = checkNeighbourhood(pSrc, srcStep, pDst, dstStep, dstRoiSize)) return s;
    const int side = sideOf(mask);
    if (side == 0) return StatusBadMaskSize;
    return boxMean(pSrc, srcStep, pDst, dstStep, dstRoiSize, 1, {side, side}, {side / 2, side / 2});
}

Status ZOR_CALL zoriFilterHipass_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                        ImageSize dstRoiSize, int mask) {
    if (Status s = checkNeighbourhood(pSrc, srcStep, pDst, dstStep, dstRoiSize)) return s;
    const int side = sideOf(mask);
    if (side == 0) return StatusBadMaskSize;
    return hipass(pSrc, srcStep, pDst, dstStep, dstRoiSize, side);
}

// ---- Gauss -------------------------------------------------------------------------------------

Status ZOR_CALL zoriFilterGauss_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                       ImageSize dstRoiSize, int mask) {
    return gauss<1>(pSrc, srcStep, pDst, dstStep, dstRoiSize, mask);
}

Status ZOR_CALL zoriFilterGauss_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                       ImageSize dstRoiSize, int mask) {
    return gauss<3>(pSrc, srcStep, pDst, dstStep, dstRoiSize, mask);
}

// ---- Wiener ------------------------------------------------------------------------------------

Status ZOR_CALL zoriFilterWiener_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                        ImageSize dstRoiSize, ImageSize maskSize, ImagePoint anchor,
                                        float noise[1], uint8_t* pBuffer) {
    if (Status s = checkFirst(anyNull(pSrc, pDst, noise, pBuffer), badRoi(dstRoiSize), badSteps(srcStep, dstStep),
                              badWienerMask(maskSize), badAnchor(maskSize, anchor)))
        return s;
    if (!(noise[0] >= 0.0f && noise[0] < 1.0f)) return StatusBadArgument;
    // 32-bit lanes while the sums of squares stay below 2^31
    if (pixelsOf(maskSize) <= 33025)
        wiener<uint32_t>(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor, noise, pBuffer);
    else
        wiener<uint64_t>(pSrc, srcStep, pDst, dstStep, dstRoiSize, maskSize, anchor, noise, pBuffer);
    return StatusOk;
}

// ---- full convolution ----------------------------------------------------------------------------

Status ZOR_CALL zoriConvFull_32f_C1R(const float* pSrc1, int src1Step, ImageSize src1Size, const float* pSrc2,
                                     int src2Step, ImageSize src2Size, float* pDst, int dstStep) {
    ImageSize out{};
    if (Status s = checkConv(pSrc1, src1Step, src1Size, pSrc2, src2Step, src2Size, pDst, dstStep, out)) return s;
    const Image<float> a{pSrc1, src1Step, src1Size}, k{pSrc2, src2Step, src2Size};
    DoublePrecisionScope precision;
    if (convFloatSimd(a, k, pDst, dstStep, out)) return StatusOk;
    for (int y = 0; y < out.height; ++y) {
        float* d = rowAt(pDst, dstStep, y);
        for (int x = 0; x < out.width; ++x) d[x] = toFloat(convSample<double>(a, k, x, y));
    }
    return StatusOk;
}

Status ZOR_CALL zoriConvFull_8u_C1R(const uint8_t* pSrc1, int src1Step, ImageSize src1Size, const uint8_t* pSrc2,
                                    int src2Step, ImageSize src2Size, uint8_t* pDst, int dstStep, int divisor) {
    ImageSize out{};
    if (Status s = checkConv(pSrc1, src1Step, src1Size, pSrc2, src2Step, src2Size, pDst, dstStep, out)) return s;
    if (divisor == 0) return StatusBadDivisor;
    Image<uint8_t> a{pSrc1, src1Step, src1Size}, k{pSrc2, src2Step, src2Size};
    // integer sums do not depend on the order of their terms: the smaller
    // image serves as the kernel
    if (pixelsOf(k.size) > pixelsOf(a.size)) std::swap(a, k);
    if (convBytesSimd(a, k, pDst, dstStep, out, divisor)) return StatusOk;
    for (int y = 0; y < out.height; ++y) {
        uint8_t* d = rowAt(pDst, dstStep, y);
        for (int x = 0; x < out.width; ++x) d[x] = divideHalfUp(convSample<int64_t>(a, k, x, y), divisor);
    }
    return StatusOk;
}

#endif  // ZOR_SSE2UP entries

// ---- buffer size -----------------------------------------------------------------------------------

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
// The plain sums and the sums of squares in 64-bit lanes: the most that
// FilterWiener takes.
Status ZOR_CALL zoriFilterWienerGetBufferSize(ImageSize dstRoiSize, ImageSize maskSize, int channels,
                                              int* pBufferSize) {
    if (Status s = checkFirst(anyNull(pBufferSize), badRoi(dstRoiSize), badWienerMask(maskSize))) return s;
    if (channels < 1) return StatusBadChannelCount;
    const int64_t lanes = BoxSums<uint64_t, 1>::lanesNeeded(int64_t(dstRoiSize.width) * channels, maskSize.width,
                                                            channels);
    const int64_t bytes = 2 * lanes * 8 + kBufferAlign;
    if (bytes > INT_MAX) return StatusBadSize;
    *pBufferSize = int(bytes);
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
