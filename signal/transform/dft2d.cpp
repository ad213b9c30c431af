// Two-dimensional DFT of real float images of any size, packed as CCS (the
// layout and the rules are in the manifest's section comment).
//
// Forward: the rows go in pairs as one complex transform each (row 2j the
// real part, row 2j + 1 the imaginary part), whose spectrum splits into the
// two rows' spectra; they are written to the destination in CCS order, and
// the columns are transformed there: the complex columns (CCS positions
// 2k-1, 2k) as complex sequences, and the one or two real columns (position
// 0 and, for even widths, the last) as one more pair of real sequences,
// written back in CCS order down the column.  The inverse runs the same
// steps backwards: columns from the source into the destination, then rows
// in place.  Rows and columns go through the batch transform of
// dft2d_kernels.h, one sequence per register lane.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/memory.h"
#include "frame/fpu.h"
#include "frame/row_address.h"
#include "signal/transform/dft2d_kernels.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

constexpr int32_t kIdDft = 7;
constexpr int kStackFloats = 2048;  // workspaces up to this size live on the stack
constexpr int kMaxSlots = 4;        // batches of columns per sweep down the rows

#if ZOR_SIMD >= 1
using Lanes = simd::Vec<float>;
#else
using Lanes = float;
#endif
constexpr int kLanes = lanesOf<Lanes>();

// The record as callers see it (the fields up to `allocated` are
// published), then the plans.
struct DftSpec {
    int32_t id;
    int32_t width;
    int32_t height;
    int32_t forwardScaled;
    int32_t inverseScaled;
    float scale;
    uint32_t hint;
    int32_t bufferSize;  // bytes a caller's pBuffer needs; 0: none
    int32_t allocated;
    int32_t workFloats;  // floats in each workspace array
    int32_t slots;       // batches of columns per sweep (1 .. kMaxSlots)
    Plan rows;           // length width
    Plan cols;           // length height
};

// ---- checks and composition ---------------------------------------------------------

// Null spec, identifier, null images, then steps: shorter than a row
// (StatusBadStep) or not whole floats (StatusNotEvenStep).
Status checkCall(const float* src, int srcStep, const float* dst, int dstStep, const void* pSpec) {
    if (!pSpec) return StatusNullPointer;
    const DftSpec* s = static_cast<const DftSpec*>(pSpec);
    if (s->id != kIdDft) return StatusContextMismatch;
    if (Status st = anyNull(src, dst)) return st;
    const int64_t row = int64_t(s->width) * 4;
    if (srcStep < row || dstStep < row) return StatusBadStep;
    if (srcStep % 4 != 0 || dstStep % 4 != 0) return StatusNotEvenStep;
    return StatusOk;
}

// The batch workspace: per slot a pair of arrays for the data and a pair to
// work in (the row pass and the real columns use slot 0).  Several slots
// let one sweep down the rows gather (and scatter) several batches of
// columns.
struct Work {
    int slots;
    Span<Lanes> data[kMaxSlots], spare[kMaxSlots];
    // The pair of slot 0 that does not hold z (a result of transform).
    Span<Lanes> other(Span<Lanes> z) const {
        return z.re == data[0].re || z.re == data[0].im ? spare[0] : data[0];
    }
};

// Floats from one workspace array to the next: the arrays start on
// different cache sets even when their length is a power of two.
ptrdiff_t arrayStride(int32_t workFloats) { return ptrdiff_t(workFloats) + 16; }

// Runs body(Work) on the caller's buffer, an own allocation or the stack.
template <class Body>
Status withWork(const DftSpec& s, uint8_t* pBuffer, Body body) {
    alignas(32) float stack[kStackFloats];
    float* base = stack;
    uint8_t* own = nullptr;
    if (s.bufferSize > 0) {
        if (!pBuffer) {
            own = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(s.bufferSize)));
            if (!own) return StatusNoMemory;
            pBuffer = own;
        }
        base = reinterpret_cast<float*>((reinterpret_cast<uintptr_t>(pBuffer) + 31) & ~uintptr_t(31));
    }
    const ptrdiff_t f = arrayStride(s.workFloats);
    Work w{s.slots, {}, {}};
    for (int g = 0; g < s.slots; ++g) {
        float* a = base + 4 * g * f;
        w.data[g] = {a, a + f};
        w.spare[g] = {a + 2 * f, a + 3 * f};
    }
    SinglePrecisionScope precision;
    body(w);
    mem::alignedFree(own);
    return StatusOk;
}

// CCS position of the last real column, or -1 for odd widths.
int lastRealColumn(int width) { return width % 2 == 0 ? width - 1 : -1; }

void forwardRows(const DftSpec& s, const float* src, int srcStep, float* dst, int dstStep, const Work& w) {
    for (int y0 = 0; y0 < s.height; y0 += 2 * kLanes) {
        gatherRows<Lanes>(src, srcStep, y0, s.height, s.width, w.data[0].re, w.data[0].im);
        const Span<Lanes> z = transform(s.rows, w.data[0], w.spare[0]);
        const Span<Lanes> out = w.other(z);
        splitSpectra(z, s.width, out.re, out.im);
        scatterRows<Lanes>(out.re, out.im, dst, dstStep, y0, s.height, s.width);
    }
}

// The complex columns (CCS positions 2k-1, 2k) from src into dst, forward
// or inverse (a forward transform on swapped parts), as many batches per
// sweep as the workspace has slots.
void complexColumns(const DftSpec& s, const float* src, int srcStep, float* dst, int dstStep, const Work& w,
                    bool inverse) {
    const int h = s.height, pairs = (s.width - 1) / 2, perSweep = w.slots * kLanes;
    const bool scaled = inverse ? false : s.forwardScaled != 0;
    for (int c = 0; c < pairs; c += perSweep) {
        const int count = pairs - c < perSweep ? pairs - c : perSweep;
        const int used = (count + kLanes - 1) / kLanes;
        Span<Lanes> in[kMaxSlots], out[kMaxSlots];
        for (int g = 0; g < used; ++g) in[g] = inverse ? w.data[g].swapped() : w.data[g];
        gatherPairs(src, srcStep, h, 1 + 2 * c, count, in);
        for (int g = 0; g < used; ++g) {
            out[g] = transform(s.cols, w.data[g], w.spare[g]);
            if (inverse) out[g] = out[g].swapped();
            if (scaled) scaleSpan(out[g], h, s.scale);
        }
        scatterPairs(out, dst, dstStep, h, 1 + 2 * c, count);
    }
}

void forwardColumns(const DftSpec& s, float* img, int step, const Work& w) {
    const int h = s.height, last = lastRealColumn(s.width);
    gatherColumns(img, step, h, 0, last, w.data[0].re, w.data[0].im, kLanes);
    const Span<Lanes> z = transform(s.cols, w.data[0], w.spare[0]);
    const Span<Lanes> out = w.other(z);
    splitSpectra(z, h, out.re, out.im);
    if (s.forwardScaled) scaleSpan(out, h, s.scale);
    scatterColumns(out.re, out.im, kLanes, img, step, h, 0, last);
    complexColumns(s, img, step, img, step, w, false);
}

// The inverse transforms are forward ones on swapped parts.
void inverseColumns(const DftSpec& s, const float* src, int srcStep, float* dst, int dstStep, const Work& w) {
    const int h = s.height, last = lastRealColumn(s.width);
    gatherColumns(src, srcStep, h, 0, last, w.spare[0].re, w.spare[0].im, kLanes);
    joinSpectra(w.spare[0].re, w.spare[0].im, h, w.data[0].swapped());
    const Span<Lanes> z = transform(s.cols, w.data[0], w.spare[0]).swapped();
    scatterColumns(z.re, z.im, kLanes, dst, dstStep, h, 0, last);
    complexColumns(s, src, srcStep, dst, dstStep, w, true);
}

void inverseRows(const DftSpec& s, float* img, int step, const Work& w) {
    for (int y0 = 0; y0 < s.height; y0 += 2 * kLanes) {
        gatherRows<Lanes>(img, step, y0, s.height, s.width, w.spare[0].re, w.spare[0].im);
        joinSpectra(w.spare[0].re, w.spare[0].im, s.width, w.data[0].swapped());
        const Span<Lanes> z = transform(s.rows, w.data[0], w.spare[0]).swapped();
        if (s.inverseScaled) scaleSpan(z, s.width, s.scale);
        scatterRows<Lanes>(z.re, z.im, img, step, y0, s.height, s.width);
    }
}

// ---- spec construction ---------------------------------------------------------------

// Hands out 32-byte aligned pieces of one block; with a null base it only
// measures.
struct Arena {
    uint8_t* base;
    int64_t used;
    template <class T>
    T* take(int64_t count) {
        const int64_t at = (used + 31) & ~int64_t(31);
        used = at + count * int64_t(sizeof(T));
        return base ? reinterpret_cast<T*>(base + at) : nullptr;
    }
};

// The smallest 2^a 3^b 5^c at or above n.
int64_t smoothAtLeast(int64_t n) {
    int64_t best = int64_t(1) << 62;
    for (int64_t p5 = 1; p5 < best; p5 *= 5)
        for (int64_t p35 = p5; p35 < best; p35 *= 3) {
            int64_t v = p35;
            while (v < n) v *= 2;
            if (v < best) best = v;
        }
    return best;
}

// The radices of n, largest power of 4 first; false when n has a prime
// factor above kMaxOddRadix.
bool factorize(int64_t n, int* radices, int& count) {
    count = 0;
    while (n % 4 == 0) radices[count++] = 4, n /= 4;
    if (n % 2 == 0) radices[count++] = 2, n /= 2;
    for (int p = 3; p <= kMaxOddRadix; p += 2)
        while (n % p == 0) radices[count++] = p, n /= p;
    return n == 1;
}

// Elements of the sequences the transform of length n works on.
int64_t workLength(int64_t n) {
    int radices[kMaxStages], count;
    return factorize(n, radices, count) ? n : smoothAtLeast(2 * n - 1);
}

// Lays out (and with a real arena fills, except the Bluestein kernel) the
// plan of length n; plan is null while measuring.
void buildPlan(Plan* plan, int64_t n, Arena& arena) {
    int radices[kMaxStages], count;
    const bool direct = factorize(n, radices, count);
    if (plan) {
        std::memset(plan, 0, sizeof(Plan));
        plan->n = static_cast<int32_t>(n);
    }
    if (!direct) {
        const int64_t m = workLength(n);
        Plan* conv = arena.take<Plan>(1);
        buildPlan(conv, m, arena);
        float* chirp = arena.take<float>(2 * n);
        float* kernel = arena.take<float>(2 * m);
        if (!plan) return;
        plan->convLength = static_cast<int32_t>(m);
        plan->conv = conv;
        plan->chirp = chirp;
        plan->kernel = kernel;
        for (int64_t k = 0; k < n; ++k) forwardRoot(k * k % (2 * n), 2 * n, chirp + 2 * k);
        return;
    }
    int64_t span = 1;
    for (int i = 0; i < count; ++i) {
        const int p = radices[i];
        float* tw = arena.take<float>(2 * span * (p - 1));
        float* roots = (p & 1) ? arena.take<float>(2 * p) : nullptr;
        if (plan) {
            plan->stages[i] = {p, tw, roots};
            for (int64_t q = 0; q < span; ++q)
                for (int v = 1; v < p; ++v) forwardRoot(v * q, span * p, tw + 2 * (q * (p - 1) + v - 1));
            for (int j = 0; roots && j < p; ++j) forwardRoot(j, p, roots + 2 * j);
        }
        span *= p;
    }
    if (plan) plan->stageCount = count;
}

// The Bluestein kernel: the transform of conj(chirp) placed at 0 .. n-1 and
// wrapped to m-n+1 .. m-1, divided by m.  Computed with the batch transform
// itself (lane 0), so every variant holds the same kernel.
Status fillKernel(const Plan& plan) {
    const int64_t n = plan.n, m = plan.convLength;
    const int64_t f = m * kLanes;
    float* buf = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(16 * f)));
    if (!buf) return StatusNoMemory;
    std::memset(buf, 0, static_cast<size_t>(16 * f));
    const Span<Lanes> data{buf, buf + f}, spare{buf + 2 * f, buf + 3 * f};
    for (int64_t t = 0; t < n; ++t) {
        const float re = plan.chirp[2 * t], im = -plan.chirp[2 * t + 1];
        data.re[t * kLanes] = re;
        data.im[t * kLanes] = im;
        if (t > 0) {
            data.re[(m - t) * kLanes] = re;
            data.im[(m - t) * kLanes] = im;
        }
    }
    float inv;
    {
        DoublePrecisionScope dp;
        inv = toFloat(1.0 / static_cast<double>(m));
    }
    {
        SinglePrecisionScope sp;
        const Span<Lanes> z = transform(*plan.conv, data, spare);
        float* kernel = const_cast<float*>(plan.kernel);
        for (int64_t k = 0; k < m; ++k) {
            kernel[2 * k] = z.re[k * kLanes] * inv;
            kernel[2 * k + 1] = z.im[k * kLanes] * inv;
        }
    }
    mem::alignedFree(buf);
    return StatusOk;
}

Status initSpec(void** ppSpec, ImageSize roi, int flag, int hint) {
    if (!ppSpec) return StatusNullPointer;
    if (Status st = badRoi(roi)) return st;
    if (flag != 1 && flag != 2 && flag != 4 && flag != 8) return StatusBadFlag;
    Arena measure{nullptr, 0};
    measure.take<DftSpec>(1);
    buildPlan(nullptr, roi.width, measure);
    buildPlan(nullptr, roi.height, measure);
    // The workspace: four arrays of the longest sequence, one per lane.
    const int64_t len = std::max(workLength(roi.width), workLength(roi.height));
    // As many slots of four arrays (up to kMaxSlots) as fit in 256 KiB.
    const int64_t slots = std::max<int64_t>(1, std::min<int64_t>(kMaxSlots, (256 << 10) / (16 * len * kLanes)));
    const int64_t workBytes = 16 * slots * arrayStride(static_cast<int32_t>(std::min<int64_t>(len * kLanes, 1 << 30)));
    const int64_t buffer = workBytes <= int64_t(kStackFloats) * 4 ? 0 : workBytes + 32;
    // Sizes the 32-bit record fields cannot express are as good as an
    // allocation failure.
    if (measure.used > 0x7FFFFFFF || buffer > 0x7FFFFFFF) return StatusNoMemory;
    uint8_t* block = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(measure.used)));
    if (!block) return StatusNoMemory;

    Arena arena{block, 0};
    DftSpec* s = arena.take<DftSpec>(1);
    std::memset(s, 0, sizeof(DftSpec));
    const double points = double(roi.width) * double(roi.height);
    {
        DoublePrecisionScope dp;
        s->scale = flag == 4 ? toFloat(1.0 / std::sqrt(points)) : flag == 8 ? 1.0f : toFloat(1.0 / points);
        buildPlan(&s->rows, roi.width, arena);
        buildPlan(&s->cols, roi.height, arena);
    }
    s->width = roi.width;
    s->height = roi.height;
    s->forwardScaled = (flag == 1 || flag == 4) ? 1 : 0;
    s->inverseScaled = (flag == 2 || flag == 4) ? 1 : 0;
    s->hint = static_cast<uint32_t>(hint);
    s->bufferSize = static_cast<int32_t>(buffer);
    s->allocated = 1;
    s->workFloats = static_cast<int32_t>(len * kLanes);
    s->slots = static_cast<int32_t>(slots);
    for (const Plan* p : {&s->rows, &s->cols})
        if (p->convLength) {
            if (Status st = fillKernel(*p)) {
                mem::alignedFree(block);
                return st;
            }
        }
    s->id = kIdDft;
    *ppSpec = s;
    return StatusOk;
}

}  // namespace

Status ZOR_CALL zoriDFTInitAlloc_R_32f(void** ppSpec, ImageSize roiSize, int flag, int hint) {
    return initSpec(ppSpec, roiSize, flag, hint);
}

Status ZOR_CALL zoriDFTFree_R_32f(void* pSpec) {
    if (!pSpec) return StatusNullPointer;
    DftSpec* s = static_cast<DftSpec*>(pSpec);
    if (s->id != kIdDft) return StatusContextMismatch;
    s->id = 0;  // a second free is then refused rather than releasing twice
    mem::alignedFree(s);
    return StatusOk;
}

Status ZOR_CALL zoriDFTFwd_RToPack_32f_C1R(const float* pSrc, int srcStep, float* pDst, int dstStep,
                                           const void* pSpec, uint8_t* pBuffer) {
    if (Status st = checkCall(pSrc, srcStep, pDst, dstStep, pSpec)) return st;
    const DftSpec& s = *static_cast<const DftSpec*>(pSpec);
    return withWork(s, pBuffer, [&](const Work& w) {
        forwardRows(s, pSrc, srcStep, pDst, dstStep, w);
        forwardColumns(s, pDst, dstStep, w);
    });
}

Status ZOR_CALL zoriDFTInv_PackToR_32f_C1R(const float* pSrc, int srcStep, float* pDst, int dstStep,
                                           const void* pSpec, uint8_t* pBuffer) {
    if (Status st = checkCall(pSrc, srcStep, pDst, dstStep, pSpec)) return st;
    const DftSpec& s = *static_cast<const DftSpec*>(pSpec);
    return withWork(s, pBuffer, [&](const Work& w) {
        inverseColumns(s, pSrc, srcStep, pDst, dstStep, w);
        inverseRows(s, pDst, dstStep, w);
    });
}

}}  // namespace zor::ZOR_NS
