// Resize: the general engine behind zoriResize_* (nearest, linear, cubic,
// Lanczos and super-sampling, as separable row passes), the read guard and
// the alternate super-sampling of the 8u exports, and the shifted and
// centred resizes.  The rules are listed with the exports in
// zor_manifest.h.
//
// The engine maps each direction on its own (AxisMap: the plain resize's
// centre-aligned mapping, or the shifted and centred resizes' points),
// turns the mapping into tap tables (resize_kernels.h) and makes every
// destination row from the source rows of its vertical taps, then from the
// intermediate row's horizontal taps (resize_rows.h).
#include "frame/variant.h"
#include "frame/attach.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/row_address.h"
#include "frame/status.h"
#include "image/geometry/resize_kernels.h"
#include "image/geometry/resize_rows.h"

#include <cmath>
#include <cstring>
#include <type_traits>

#if defined(_WIN32)
#  ifndef WIN32_LEAN_AND_MEAN
#    define WIN32_LEAN_AND_MEAN
#  endif
#  ifndef NOMINMAX
#    define NOMINMAX
#  endif
#  include <windows.h>
#else
#  include <sys/uio.h>
#  include <unistd.h>
#endif

namespace zor { namespace ZOR_NS {
namespace {

// ---- checks --------------------------------------------------------------------------

constexpr bool knownInterpolation(int m) {
    return m == InterNearest || m == InterLinear || m == InterCubic || m == InterSuper || m == InterLanczos;
}

// The engine's checks in their order.  The shifted resize passes fractions
// (source pixels per destination pixel), of which 0 is accepted.
template <class T>
Status resizeChecks(const T* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, const T* pDst, int dstStep,
                    ImageSize dstSize, double xScale, double yScale, int interpolation, bool fractions) {
    if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(srcSize), badRoi(ImageSize{roi.width, roi.height}),
                              badRoi(dstSize), badSteps(srcStep, dstStep)))
        return s;
    if (roi.x < 0 || roi.y < 0 || roi.x >= srcSize.width || roi.y >= srcSize.height) return StatusWarnNoOperation;
    const bool badScale = fractions ? !(xScale >= 0 && yScale >= 0) : !(xScale > 0 && yScale > 0);
    if (badScale) return StatusBadResizeFactor;
    if (!knownInterpolation(interpolation)) return StatusBadInterpolation;
    return StatusOk;
}

// The ROI limited to the image (its origin inside).
ImageRect clipped(ImageRect roi, ImageSize image) {
    if (roi.width > image.width - roi.x) roi.width = image.width - roi.x;
    if (roi.height > image.height - roi.y) roi.height = image.height - roi.y;
    return roi;
}

// ---- composition ------------------------------------------------------------------------

template <class T, int C>
Status resizeEngine(const T* src, ImageSize srcSize, int srcStep, T* dst, int dstStep, ImageSize dstSize,
                    const AxisMap& mx, const AxisMap& my, int mode);

template <class T, int C>
Status resizePlain(const T* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, T* pDst, int dstStep,
                   ImageSize dstSize, double xFactor, double yFactor, int interpolation) {
    if (Status s = resizeChecks(pSrc, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor,
                                interpolation, false))
        return s;
    return resizeEngine<T, C>(pSrc, srcSize, srcStep, pDst, dstStep, dstSize, AxisMap::centres(roi.x, xFactor),
                              AxisMap::centres(roi.y, yFactor), interpolation);
}

template <int C>
Status resizeGuarded(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst, int dstStep,
                     ImageSize dstSize, double xFactor, double yFactor, int interpolation);
#if ZOR_SIMD >= 2
Status superSampleBySpans(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst,
                          int dstStep, ImageSize dstSize, double xFactor, double yFactor);
#endif

// The 8u exports: the alternate super-sampling (three channels, SSE2 and
// up, marker file present), else the read guard, else the engine.
template <int C>
Status resize8u(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst, int dstStep,
                ImageSize dstSize, double xFactor, double yFactor, int interpolation) {
#if ZOR_SIMD >= 2
    if constexpr (C == 3)
        if (interpolation == InterSuper && frame::altSuperSampling)
            return superSampleBySpans(pSrc, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor);
#endif
    if (interpolation == InterSuper && roi.height % 2 != 0)
        return resizeGuarded<C>(pSrc, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor,
                                interpolation);
    return resizePlain<uint8_t, C>(pSrc, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor,
                                   interpolation);
}

// Destination pixels [i0, i1) of d whose sample lies in the pixel area
// [start - 0.5, start + len - 0.5) of a ROI (the mapping increases with i).
inline void coveredRange(const AxisMap& m, int start, int len, int d, int& i0, int& i1) {
    const double lo = start - 0.5, hi = start + len - 0.5;
    const auto firstAtOrAbove = [&](double bound) {
        int i = int(clampTo(m.shift + (bound - m.origin) / m.step, 0, d));
        while (i > 0 && m.at(i - 1) >= bound) --i;
        while (i < d && m.at(i) < bound) ++i;
        return i;
    };
    i0 = firstAtOrAbove(lo);
    i1 = firstAtOrAbove(hi);
    if (i1 < i0) i1 = i0;
}

template <int C>
Status resizeCenter(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst, int dstStep,
                    ImageSize dstSize, double xFactor, double yFactor, double xCenter, double yCenter,
                    int interpolation) {
    if (!pDst) return StatusNullPointer;
    if (Status s = resizeChecks(pSrc, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor,
                                interpolation, false))
        return s;
    DoublePrecisionScope precision;
    const ImageRect r = clipped(roi, srcSize);
    AxisMap mx = AxisMap::points(xCenter, xCenter, 1 / xFactor), my = AxisMap::points(yCenter, yCenter, 1 / yFactor);
    int i0, i1, j0, j1;
    coveredRange(mx, r.x, r.width, dstSize.width, i0, i1);
    coveredRange(my, r.y, r.height, dstSize.height, j0, j1);
    if (i0 == i1 || j0 == j1) return StatusOk;
    mx.skip = i0;
    my.skip = j0;
    return resizeEngine<uint8_t, C>(pSrc, srcSize, srcStep, rowAt(pDst, dstStep, j0) + ptrdiff_t(i0) * C, dstStep,
                                    ImageSize{i1 - i0, j1 - j0}, mx, my, interpolation);
}

}  // namespace

// ---- exports ------------------------------------------------------------------------------

#define ZOR_RESIZE_EXPORT(name, T, call)                                                                        \
    Status ZOR_CALL name(const T* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, T* pDst, int dstStep, \
                         ImageSize dstRoiSize, double xFactor, double yFactor, int interpolation) {            \
        return call(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoiSize, xFactor, yFactor, interpolation); \
    }
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
ZOR_RESIZE_EXPORT(zoriResize_8u_C1R, uint8_t, resize8u<1>)
ZOR_RESIZE_EXPORT(zoriResize_8u_C3R, uint8_t, resize8u<3>)
ZOR_RESIZE_EXPORT(zoriResize_8u_C4R, uint8_t, resize8u<4>)

Status ZOR_CALL zoriResizeShift_8u_C3R(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                                       uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFr, double yFr,
                                       double xShift, double yShift, int interpolation) {
    if (Status s = resizeChecks(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoiSize, xFr, yFr, interpolation,
                                true))
        return s;
    return resizeEngine<uint8_t, 3>(pSrc, srcSize, srcStep, pDst, dstStep, dstRoiSize,
                                    AxisMap::points(srcRoi.x, xShift, xFr), AxisMap::points(srcRoi.y, yShift, yFr),
                                    interpolation);
}

Status ZOR_CALL zoriResizeCenter_8u_C1R(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                                        uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor,
                                        double yFactor, double xCenter, double yCenter, int interpolation) {
    return resizeCenter<1>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoiSize, xFactor, yFactor, xCenter,
                           yCenter, interpolation);
}
Status ZOR_CALL zoriResizeCenter_8u_C3R(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                                        uint8_t* pDst, int dstStep, ImageSize dstRoiSize, double xFactor,
                                        double yFactor, double xCenter, double yCenter, int interpolation) {
    return resizeCenter<3>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoiSize, xFactor, yFactor, xCenter,
                           yCenter, interpolation);
}
#endif

ZOR_RESIZE_EXPORT(zoriResize_16u_C1R, uint16_t, (resizePlain<uint16_t, 1>))
ZOR_RESIZE_EXPORT(zoriResize_16u_C3R, uint16_t, (resizePlain<uint16_t, 3>))
ZOR_RESIZE_EXPORT(zoriResize_16u_C4R, uint16_t, (resizePlain<uint16_t, 4>))
ZOR_RESIZE_EXPORT(zoriResize_32f_C1R, float, (resizePlain<float, 1>))
ZOR_RESIZE_EXPORT(zoriResize_32f_C3R, float, (resizePlain<float, 3>))
ZOR_RESIZE_EXPORT(zoriResize_32f_C4R, float, (resizePlain<float, 4>))
#undef ZOR_RESIZE_EXPORT

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
// Checks in the order below: the values before the output pointers.
Status ZOR_CALL zoriGetResizeFract(ImageSize srcSize, ImageRect srcRoi, double xFactor, double yFactor, double* pXFr,
                                   double* pYFr, int interpolation) {
    if (srcSize.width < 1 || srcSize.height < 1 || srcRoi.x < 0 || srcRoi.y < 0 || srcRoi.width < 1 ||
        srcRoi.height < 1)
        return StatusBadSize;
    if (srcSize.width <= srcRoi.x || srcSize.height <= srcRoi.y) return StatusWarnNoOperation;
    if (xFactor <= 0 || yFactor <= 0) return StatusBadResizeFactor;  // NaN passes
    if (!pXFr || !pYFr) return StatusNullPointer;
    if (interpolation != InterNearest && interpolation != InterLinear && interpolation != InterCubic &&
        interpolation != InterLanczos)
        return StatusBadInterpolation;
    DoublePrecisionScope precision;
    const ImageRect r = clipped(srcRoi, srcSize);
    // Corner pixels meet: the ROI's first-to-last extent over the destination's.
    const auto fraction = [&](double factor, int len) {
        if (interpolation == InterNearest) return 1 / factor;
        return factor * len > 1 ? (len - 1) / (factor * len - 1) : 0.0;
    };
    *pXFr = toDouble(fraction(xFactor, r.width));
    *pYFr = toDouble(fraction(yFactor, r.height));
    return StatusOk;
}
#endif

namespace {

// ---- the engine ------------------------------------------------------------------------------

// Lays arrays out in one aligned block: the layout is run once to size the
// block, then again to hand out the arrays.
class Carve {
public:
    explicit Carve(uint8_t* base = nullptr) : base_(base) {}
    template <class U>
    U* take(int64_t count) {
        used_ = (used_ + 31) & ~uint64_t(31);
        U* p = base_ ? reinterpret_cast<U*>(base_ + used_) : nullptr;
        used_ += uint64_t(count > 0 ? count : 0) * sizeof(U);
        return p;
    }
    uint64_t bytes() const { return used_; }

private:
    uint8_t* base_;
    uint64_t used_ = 0;
};

template <class Layout>
void* allocateLayout(Layout layout) {
    Carve sizing;
    layout(sizing);
    if (sizing.bytes() > 0x7FFFFF00u) return nullptr;
    void* block = mem::alignedAlloc(uint32_t(sizing.bytes()));
    if (!block) return nullptr;
    Carve carve(static_cast<uint8_t*>(block));
    layout(carve);
    return block;
}

template <class T, int C>
Status resizeNearest(const T* src, ImageSize srcSize, int srcStep, T* dst, int dstStep, ImageSize dstSize,
                     const AxisMap& mx, const AxisMap& my) {
    int32_t* xs = nullptr;
    void* block = allocateLayout([&](Carve& c) { xs = c.template take<int32_t>(dstSize.width); });
    if (!block) return StatusNoMemory;
    for (int x = 0; x < dstSize.width; ++x) xs[x] = nearestPixel(mx, x, srcSize.width) * C;
    // Three-byte pixels move as four bytes (the next pixel rewrites the
    // fourth) wherever the source row has the byte after them.
    int wide = 0;
    if constexpr (sizeof(T) * C == 3)
        while (wide < dstSize.width - 1 && xs[wide] < (srcSize.width - 1) * C) ++wide;
    const size_t rowBytes = size_t(dstSize.width) * C * sizeof(T);
    int previous = -1;
    for (int y = 0; y < dstSize.height; ++y) {
        const int sy = nearestPixel(my, y, srcSize.height);
        T* d = rowAt(dst, dstStep, y);
        if (sy == previous) {  // the row above again
            std::memcpy(d, rowAt(dst, dstStep, y - 1), rowBytes);
            continue;
        }
        const T* s = rowAt(src, srcStep, previous = sy);
        int x = 0;
        for (; x < wide; ++x) std::memcpy(d + x * C, s + xs[x], 4);
        for (; x < dstSize.width; ++x) std::memcpy(d + x * C, s + xs[x], C * sizeof(T));
    }
    mem::alignedFree(block);
    return StatusOk;
}

// Whether super-sampling by exactly one half reads whole 2 x 2 blocks
// inside the image.
bool halvesInside(const AxisMap& m, int d, int n) {
    return m.centred && m.skip == 0 && m.factor == 0.5 && m.origin + 2.0 * d <= n;
}

// Both passes for every destination row; A is the arithmetic.
template <class A, class T, int C>
Status separable(const T* src, ImageSize srcSize, int srcStep, T* dst, int dstStep, ImageSize dstSize,
                 const AxisMap& mx, const AxisMap& my, int mode, const AxisShape& sx, const AxisShape& sy) {
    using W = typename A::Weight;
    using I = typename A::Inter;
    const int dw = dstSize.width, dh = dstSize.height, sw = srcSize.width, sh = srcSize.height;

    // Columns of narrow footprints may be gathered: their table is uniform.
    const bool gathered = A::template kGathers<T> && sx.widest <= kGatherTaps;
    AxisTable<W> xt, yt;
    double* scratch = nullptr;
    void* tables = allocateLayout([&](Carve& c) {
        xt.first = c.template take<int32_t>(dw);
        xt.offset = c.template take<int32_t>(dw + 1);
        xt.weight = c.template take<W>(sx.entries(gathered, dw));
        yt.first = c.template take<int32_t>(dh);
        yt.offset = c.template take<int32_t>(dh + 1);
        yt.weight = c.template take<W>(sy.total);
        scratch = c.template take<double>(sx.widest > sy.widest ? sx.widest : sy.widest);
    });
    if (!tables) return StatusNoMemory;
    fillAxisTable(xt, mx, mode, dw, sw, gathered, sx.widest, A::weight, scratch);
    fillAxisTable(yt, my, mode, dh, sh, false, sy.widest, A::weight, scratch);

    // The intermediate row holds source pixels [xt.lo, xt.hi); the image's
    // own columns are computed, those beyond its edges copied from them.
    const int computedLo = xt.lo > 0 ? xt.lo : 0, computedHi = xt.hi < sw ? xt.hi : sw;
    const ptrdiff_t interLen = ptrdiff_t(xt.hi - xt.lo) * C + 256 / sizeof(I);  // gather windows may read past
    constexpr int lanes = 16 / sizeof(I);
    GatherPlan plan;
    int windows = 0;
#if ZOR_SIMD >= 4
    if (gathered) windows = gatherWindows(xt, C, dw, lanes);
#endif
    const int64_t blocks = windows ? int64_t(dw) * C / lanes : 0;
    const T** rows = nullptr;
    I* inter = nullptr;
    void* buffers = allocateLayout([&](Carve& c) {
        plan.base = c.template take<int32_t>(blocks);
        plan.masks = c.template take<uint8_t>(blocks * windows * 16);
        plan.weights = c.template take<uint8_t>(blocks * xt.taps * 16);
        rows = c.template take<const T*>(sy.widest);
        inter = c.template take<I>(interLen);
    });
    if (!buffers) {
        mem::alignedFree(tables);
        return StatusNoMemory;
    }
    if (windows) fillGatherPlan(plan, xt, C, dw, lanes, windows, A::kWideGatherBytes);
    std::memset(inter, 0, size_t(interLen) * sizeof(I));

    I* computed = inter + ptrdiff_t(computedLo - xt.lo) * C;
    const ptrdiff_t len = ptrdiff_t(computedHi - computedLo) * C;
    for (int y = 0; y < dh; ++y) {
        const int n = yt.count(y);
        for (int k = 0; k < n; ++k) {
            int r = yt.first[y] + k;
            r = r < 0 ? 0 : r > sh - 1 ? sh - 1 : r;
            rows[k] = rowAt(src, srcStep, r) + ptrdiff_t(computedLo) * C;
        }
        A::rows(rows, yt.weights(y), n, len, computed);
        for (int p = xt.lo; p < 0; ++p) std::memcpy(inter + ptrdiff_t(p - xt.lo) * C, computed, C * sizeof(I));
        for (int p = sw; p < xt.hi; ++p)
            std::memcpy(inter + ptrdiff_t(p - xt.lo) * C, inter + ptrdiff_t(sw - 1 - xt.lo) * C, C * sizeof(I));
        columns<A>(inter, xt, plan, C, dw, rowAt(dst, dstStep, y));
    }
    mem::alignedFree(buffers);
    mem::alignedFree(tables);
    return StatusOk;
}

template <class T, int C>
Status resizeEngine(const T* src, ImageSize srcSize, int srcStep, T* dst, int dstStep, ImageSize dstSize,
                    const AxisMap& mx, const AxisMap& my, int mode) {
    DoublePrecisionScope precision;
    if (mode == InterNearest) return resizeNearest<T, C>(src, srcSize, srcStep, dst, dstStep, dstSize, mx, my);
    if constexpr (std::is_same_v<T, uint8_t> && C == 1) {
        // Exactly what the fixed-point passes give for these weights.
        if (mode == InterSuper && halvesInside(mx, dstSize.width, srcSize.width) &&
            halvesInside(my, dstSize.height, srcSize.height)) {
            for (int y = 0; y < dstSize.height; ++y) {
                const uint8_t* r0 = rowAt(src, srcStep, int(my.origin) + 2 * y) + int(mx.origin);
                average2x2(r0, rowAt(r0, srcStep, 1), rowAt(dst, dstStep, y), dstSize.width);
            }
            return StatusOk;
        }
    }
    const AxisShape sx = axisShape(mx, mode, dstSize.width, srcSize.width);
    const AxisShape sy = axisShape(my, mode, dstSize.height, srcSize.height);
    // The arithmetic by the widest footprint (see resize_rows.h for the bounds).
    const int widest = sx.widest > sy.widest ? sx.widest : sy.widest;
    if constexpr (std::is_same_v<T, uint8_t>)
        if (widest <= kGatherTaps)
            return separable<FixedPoint, T, C>(src, srcSize, srcStep, dst, dstStep, dstSize, mx, my, mode, sx, sy);
    if (widest <= (std::is_same_v<T, uint8_t> ? 1024 : std::is_same_v<T, float> ? 32 : kGatherTaps))
        return separable<FloatPoint, T, C>(src, srcSize, srcStep, dst, dstStep, dstSize, mx, my, mode, sx, sy);
    return separable<DoublePoint, T, C>(src, srcSize, srcStep, dst, dstStep, dstSize, mx, my, mode, sx, sy);
}

// ---- the read guard ------------------------------------------------------------------------

// Whether [p, p + n) can be read, found without touching it.
inline bool readable(const uint8_t* p, size_t n) {
#if defined(_WIN32)
    return !IsBadReadPtr(p, n);
#else
    // Reading the own process through process_vm_readv reports an
    // unreadable page as an error where a load would fault; one byte of
    // every page decides.  Any other failure counts as unreadable.
    const uintptr_t page = uintptr_t(sysconf(_SC_PAGESIZE));
    uintptr_t at = uintptr_t(p);
    const uintptr_t end = at + n;
    char sink[64];
    while (at < end) {
        iovec remote[64];
        int k = 0;
        for (; k < 64 && at < end; ++k) {
            remote[k] = {reinterpret_cast<void*>(at), 1};
            at = (at / page + 1) * page;
        }
        iovec local = {sink, size_t(k)};
        if (process_vm_readv(getpid(), &local, 1, remote, k, 0) != k) return false;
    }
    return true;
#endif
}

template <int C>
Status resizeGuarded(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst, int dstStep,
                     ImageSize dstSize, double xFactor, double yFactor, int interpolation) {
    const auto resize = [&](const uint8_t* from) {
        return resizePlain<uint8_t, C>(from, srcSize, srcStep, roi, pDst, dstStep, dstSize, xFactor, yFactor,
                                       interpolation);
    };
    // Only an image that the engine accepts can be probed or copied.
    if (!pSrc || srcSize.width < 1 || srcSize.height < 1 || srcStep < 1) return resize(pSrc);
    const size_t step = size_t(srcStep), n = size_t(srcSize.height) * step;
    if (readable(pSrc + n, step)) return resize(pSrc);
    // The copy: the image with its last row repeated below it.  Only the
    // rows' pixels are read (padding after the last row may be unreadable).
    const size_t rowBytes = size_t(srcSize.width) * C;
    if (rowBytes > step || n + step > 0x7FFFFF00u) return resize(pSrc);
    uint8_t* copy = static_cast<uint8_t*>(mem::alignedAlloc(uint32_t(n + step)));  // not checked, as ever
    std::memcpy(copy, pSrc, n - step + rowBytes);
    std::memcpy(copy + n, pSrc + n - step, rowBytes);
    const Status s = resize(copy);
    mem::alignedFree(copy);
    return s;
}

// ---- the alternate super-sampling --------------------------------------------------------

#if ZOR_SIMD >= 2
// The source pixels one destination column (or row) covers, in 1/256
// weights: a partial first pixel, whole pixels, a partial last pixel.
struct Span {
    uint16_t head, tail;              // partial pixels (kNoPixel: none)
    uint16_t headWeight, tailWeight;  // their weights, 0..255
    uint16_t firstWhole, wholeCount;
};
constexpr uint16_t kNoPixel = 65535;

Span spanOver(float s, float e) {
    Span sp{};
    const float fs = std::floor(s), fe = std::floor(e);
    if (s > fs) {
        sp.head = uint16_t(int(fs));
        sp.headWeight = uint16_t(int((1 - (s - fs)) * 256));
        sp.firstWhole = uint16_t(int(fs) + 1);
    } else {
        sp.head = kNoPixel;
        sp.firstWhole = uint16_t(int(s));
    }
    const int whole = int(fe) - sp.firstWhole;
    sp.wholeCount = uint16_t(whole > 0 ? whole : 0);
    if (e > fe) {
        sp.tail = uint16_t(int(fe));
        sp.tailWeight = uint16_t(int((e - fe) * 256));
    } else {
        sp.tail = kNoPixel;
    }
    return sp;
}

// Spans of d destination pixels over a ROI of len pixels starting at `at`.
void spansOver(Span* spans, int d, float first, float extent, float len) {
    for (int i = 0; i < d; ++i) {
        float s = first + float(i) * extent;
        s = s < 0 ? 0 : s > len ? len : s;
        const float e = s + extent < len ? s + extent : len;
        spans[i] = spanOver(s, e);
    }
}

Status superSampleBySpans(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect roi, uint8_t* pDst,
                          int dstStep, ImageSize dstSize, double xFactor, double yFactor) {
    // No argument is checked and nothing is reported; what cannot be done
    // is left undone.
    const float rx = float(1.0 / xFactor), ry = float(1.0 / yFactor);
    const ImageRect r = clipped(roi, srcSize);
    const int dw = dstSize.width, dh = dstSize.height;
    if (!pSrc || !pDst || dw < 1 || dh < 1 || !(rx > 0 && ry > 0) || !std::isfinite(rx) || !std::isfinite(ry) ||
        r.x < 0 || r.y < 0 || r.width < 1 || r.height < 1)
        return StatusOk;
    const double area = 65536.0 * xFactor * yFactor;
    const uint32_t k = area < 4294967296.0 ? uint32_t(int64_t(area)) : 0;
    // Work memory as the path always took it: row spans, column sums,
    // column spans.
    const double perColumn = rx == std::floor(rx) ? rx : std::trunc(rx + 2.0);
    const double bytes = 16.0 * dh + 12.0 * (dw * perColumn + ((dw + 3) & ~3)) + 16.0 * dw + 32;
    if (!(bytes < 0x7FFFFF00u)) return StatusOk;
    uint8_t* block = static_cast<uint8_t*>(mem::alignedAlloc(uint32_t(bytes)));
    if (!block) return StatusOk;
    std::memset(block, 0, size_t(bytes));
    Span* rowSpans = reinterpret_cast<Span*>(block);
    uint32_t* sums = reinterpret_cast<uint32_t*>(block + 16 * size_t(dh));
    Span* colSpans = reinterpret_cast<Span*>(block + 16 * size_t(dh) + 12 * size_t((dw + 3) & ~3));
    spansOver(colSpans, dw, float(std::trunc(r.x * xFactor + 0.5) / xFactor - r.x), rx, float(r.width));
    spansOver(rowSpans, dh, float(std::trunc(r.y * yFactor + 0.5) / yFactor - r.y), ry, float(r.height));

    const uint16_t* product = frame::productTable;
    const uint8_t* origin = rowAt(pSrc, srcStep, r.y) + ptrdiff_t(r.x) * 3;
    const auto addRow = [&](int row, uint32_t weight) {
        const uint8_t* p = rowAt(origin, srcStep, row);
        for (int i = 0; i < dw; ++i) {
            const Span& c = colSpans[i];
            for (int ch = 0; ch < 3; ++ch) {
                uint32_t h = 0;
                if (c.head != kNoPixel) h += product[c.headWeight * 256 + p[c.head * 3 + ch]];
                for (int q = c.firstWhole; q < c.firstWhole + c.wholeCount; ++q) h += uint32_t(p[q * 3 + ch]) << 8;
                if (c.tail != kNoPixel) h += product[c.tailWeight * 256 + p[c.tail * 3 + ch]];
                sums[i * 3 + ch] += weight == 256 ? h : (h * weight) >> 8;
            }
        }
    };
    for (int j = 0; j < dh; ++j) {
        const Span& s = rowSpans[j];
        std::memset(sums, 0, size_t(dw) * 3 * sizeof(uint32_t));
        if (s.head != kNoPixel) addRow(s.head, s.headWeight);
        for (int q = s.firstWhole; q < s.firstWhole + s.wholeCount; ++q) addRow(q, 256);
        if (s.tail != kNoPixel) addRow(s.tail, s.tailWeight);
        uint8_t* d = rowAt(pDst, dstStep, j);
        for (int e = 0; e < dw * 3; ++e) d[e] = uint8_t((sums[e] * k + (1u << 23)) >> 24);
    }
    mem::alignedFree(block);
    return StatusOk;
}
#endif

}  // namespace
}}  // namespace zor::ZOR_NS
