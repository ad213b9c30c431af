// Warps: affine, bilinear and perspective maps of an image ROI, inverted and
// sampled at every destination pixel whose source point lies in the source
// ROI, and the helpers that give their coefficients and bounds.  The rules
// are listed with the rows in the manifest.
//
// Each destination row is cut to the runs of pixels whose source point lies
// in the source ROI; a run's fixed-point source positions (warp_kernels.h)
// go to the kernel of the interpolation.  The affine map finds its one run
// a row by bisection (its source coordinates are monotone along a row) and
// forms the positions from a per-column table plus a per-row term; the
// bilinear and perspective maps invert pixel by pixel in double.  The
// affine engine also serves the rotations (rotate.cpp).
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/simd.h"
#include "frame/status.h"
#include "image/geometry/warp_kernels.h"

#include <algorithm>
#include <climits>
#include <cmath>

#if ZOR_VARIANT != 1

namespace zor { namespace ZOR_NS {
namespace {

// ---- checks ------------------------------------------------------------------------------

Status badInterpolation(int interpolation) {
    const bool known = interpolation == InterNearest || interpolation == InterLinear || interpolation == InterCubic;
    return known ? StatusOk : StatusBadInterpolation;
}

// The checks before the coefficients', in order.
Status checkImages(const void* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, const void* pDst,
                   int dstStep, ImageRect dstRoi, const void* coeffs, int interpolation) {
    return checkFirst(anyNull(pSrc, pDst, coeffs), badRoi(srcSize), badRoi(ImageSize{srcRoi.width, srcRoi.height}),
                      badRoi(ImageSize{dstRoi.width, dstRoi.height}), badSteps(srcStep, dstStep),
                      badInterpolation(interpolation));
}

template <size_t N>
bool allFinite(const double* c) {
    for (size_t i = 0; i < N; ++i)
        if (!std::isfinite(c[i])) return false;
    return true;
}

// The ROIs clipped to their images: the source to srcSize, the destination to
// x >= 0, y >= 0.
struct Clipped {
    ImageRect src, dst;
};

// False when either clipped ROI is empty.
bool clipRois(ImageSize srcSize, ImageRect srcRoi, ImageRect dstRoi, Clipped& c) {
    const int64_t sx0 = std::max<int64_t>(srcRoi.x, 0), sy0 = std::max<int64_t>(srcRoi.y, 0);
    const int64_t sx1 = std::min<int64_t>(int64_t(srcRoi.x) + srcRoi.width, srcSize.width);
    const int64_t sy1 = std::min<int64_t>(int64_t(srcRoi.y) + srcRoi.height, srcSize.height);
    const int64_t dx0 = std::max<int64_t>(dstRoi.x, 0), dy0 = std::max<int64_t>(dstRoi.y, 0);
    const int64_t dx1 = std::min<int64_t>(int64_t(dstRoi.x) + dstRoi.width, INT_MAX);
    const int64_t dy1 = std::min<int64_t>(int64_t(dstRoi.y) + dstRoi.height, INT_MAX);
    if (sx0 >= sx1 || sy0 >= sy1 || dx0 >= dx1 || dy0 >= dy1) return false;
    c.src = {int(sx0), int(sy0), int(sx1 - sx0), int(sy1 - sy0)};
    c.dst = {int(dx0), int(dy0), int(dx1 - dx0), int(dy1 - dy0)};
    return true;
}

// ---- runs of destination pixels --------------------------------------------------------

constexpr int kChunk = 256;  // positions handed to a kernel at a time
constexpr int kBand = 32;   // destination rows written together

// Collects the runs of one destination row, with their source positions, and
// hands them to the kernel.  For the 8-bit linear kernel the positions are
// kept within its limits (see linearLimit).
class RunWriter {
public:
    RunWriter(const Source& src, SampleRun sample, bool clampsLinear, uint8_t* pDst, int dstStep, int pixelBytes)
        : src_(src), sample_(sample), dst_(pDst), dstStep_(dstStep), pixelBytes_(pixelBytes),
          xLimit_(clampsLinear ? linearLimit(src.width) : INT64_MAX),
          yLimit_(clampsLinear ? linearLimit(src.height) : INT64_MAX), clamps_(clampsLinear) {}

    bool clamps() const { return clamps_; }
    int64_t xLimit() const { return xLimit_; }
    int64_t yLimit() const { return yLimit_; }
    void startRow(int y) { row_ = dst_ + ptrdiff_t(y) * dstStep_; }

    // Pixel x of the row at source position (px, py); pixels come in
    // increasing x.
    void add(int x, int64_t px, int64_t py) {
        if (n_ > 0 && (x != first_ + n_ || n_ == kChunk)) flush();
        if (n_ == 0) first_ = x;
        xs_[n_] = clampX(px);
        ys_[n_] = clampY(py);
        ++n_;
    }
    void flush() {
        if (n_ > 0) sample_(src_, {0, xs_}, {0, ys_}, n_, row_ + ptrdiff_t(first_) * pixelBytes_);
        n_ = 0;
    }

    // A run of n pixels from (x, y) whose positions need no clamping.
    void write(int y, int x, int n, Positions px, Positions py) {
        sample_(src_, px, py, n, dst_ + ptrdiff_t(y) * dstStep_ + ptrdiff_t(x) * pixelBytes_);
    }

    int64_t clampX(int64_t p) const { return clamps_ ? std::min(std::max<int64_t>(p, 0), xLimit_) : p; }
    int64_t clampY(int64_t p) const { return clamps_ ? std::min(std::max<int64_t>(p, 0), yLimit_) : p; }

private:
    const Source src_;
    const SampleRun sample_;
    uint8_t* const dst_;
    const int dstStep_, pixelBytes_;
    const int64_t xLimit_, yLimit_;
    const bool clamps_;
    uint8_t* row_ = nullptr;
    int first_ = 0, n_ = 0;
    alignas(16) int64_t xs_[kChunk + kSlack] = {}, ys_[kChunk + kSlack] = {};
};

// Narrows [lo, hi) to the x where lower <= value(x) <= upper, for value
// non-decreasing in x (rising) or non-increasing.
template <class V, class Value>
void narrowToRange(int& lo, int& hi, bool rising, V lower, V upper, Value value) {
    auto firstWhere = [&](auto holds) {  // holds: false ... false true ... true over [lo, hi)
        int l = lo, h = hi;
        while (l < h) {
            const int m = l + (h - l) / 2;
            if (holds(m)) h = m;
            else l = m + 1;
        }
        return l;
    };
    const int from = rising ? firstWhere([&](int x) { return value(x) >= lower; })
                            : firstWhere([&](int x) { return value(x) <= upper; });
    const int to = rising ? firstWhere([&](int x) { return value(x) > upper; })
                          : firstWhere([&](int x) { return value(x) < lower; });
    lo = from;
    hi = std::max(from, to);
}

// ---- the affine map ----------------------------------------------------------------------

// The inverse of x' = c00 x + c01 y + c02, y' = c10 x + c11 y + c12; false
// when the coefficients are not finite or singular.
bool invertAffine(const double c[2][3], double inv[2][3]) {
    if (!allFinite<6>(&c[0][0])) return false;
    const double det = c[0][0] * c[1][1] - c[0][1] * c[1][0];
    if (det == 0 || !std::isfinite(det)) return false;
    inv[0][0] = c[1][1] / det;
    inv[0][1] = -c[0][1] / det;
    inv[1][0] = -c[1][0] / det;
    inv[1][1] = c[0][0] / det;
    inv[0][2] = -(inv[0][0] * c[0][2] + inv[0][1] * c[1][2]);
    inv[1][2] = -(inv[1][0] * c[0][2] + inv[1][1] * c[1][2]);
    return allFinite<6>(&inv[0][0]);
}

// Source points relative to the clipped source ROI, in double:
//   u = a x + (b y + c),  v = d x + (e y + f)
// (each product and sum rounded), for destination pixel (x, y).  As
// fixed-point positions: a column table of toFixed(a x) and toFixed(d x)
// plus the row's toFixed(b y + c) and toFixed(e y + f), where every term
// stays below 2^30 in magnitude; otherwise toFixed(u), toFixed(v) pixel by
// pixel.
class AffineRows {
public:
    AffineRows(const double inv[2][3], const Clipped& c)
        : a_(inv[0][0]), b_(inv[0][1]), c_(inv[0][2] - c.src.x), d_(inv[1][0]), e_(inv[1][1]),
          f_(inv[1][2] - c.src.y), width_(c.src.width), height_(c.src.height), x0_(c.dst.x), n_(c.dst.width) {}
    ~AffineRows() { mem::alignedFree(table_); }
    AffineRows(const AffineRows&) = delete;
    AffineRows& operator=(const AffineRows&) = delete;

    // False when the column table cannot be had.
    bool prepare() {
        const double last = double(x0_) + n_ - 1;
        const double reach = std::max({std::fabs(a_ * x0_), std::fabs(a_ * last), std::fabs(d_ * x0_),
                                       std::fabs(d_ * last)});
        if (!(reach < kReach)) return true;  // pixel by pixel
        const uint64_t bytes = 2 * (uint64_t(n_) + kSlack) * sizeof(int64_t);
        if (bytes > 0xFFFF0000u) return false;
        table_ = static_cast<int64_t*>(mem::alignedAlloc(uint32_t(bytes)));
        if (!table_) return false;
        std::fill(table_, table_ + 2 * (n_ + kSlack), 0);
        for (int i = 0; i < n_; ++i) {
            table_[i] = toFixed(a_ * (x0_ + i));
            table_[n_ + kSlack + i] = toFixed(d_ * (x0_ + i));
        }
        return true;
    }

    // Rows [y0, y1), at most kBand of them: the runs of a band are written
    // kTile columns at a time, so that the source pixels they read stay
    // in cache from one row to the next.
    void rows(int y0, int y1, RunWriter& out) const {
        Span spans[kBand];
        for (int y = y0; y < y1; ++y) spans[y - y0] = spanOf(y, out);
        for (int x = x0_, end = x0_ + n_; x < end; x += std::min(kTile, end - x))
            for (int y = y0; y < y1; ++y) {
                const Span& r = spans[y - y0];
                const int lo = std::max(r.lo, x), hi = std::min(r.hi, x + std::min(kTile, end - x));
                if (lo >= hi) continue;
                const int inLo = std::clamp(r.inLo, lo, hi), inHi = std::clamp(r.inHi, inLo, hi);
                auto clamped = [&](int from, int to) {
                    out.startRow(y);
                    for (int i = from; i < to; ++i) out.add(i, r.pu + r.du[i], r.pv + r.dv[i]);
                    out.flush();
                };
                clamped(lo, inLo);
                if (inLo < inHi) out.write(y, inLo, inHi - inLo, {r.pu, r.du + inLo}, {r.pv, r.dv + inLo});
                clamped(inHi, hi);
            }
    }

    // The source step from one destination row to the next, in bytes, to
    // the first row and column that the next row may read and the current
    // one does not.
    ptrdiff_t nextRow(int srcStep, int pixelBytes) const {
        const double down = e_ > 0 ? std::ceil(e_) : std::floor(e_), right = b_ > 0 ? std::ceil(b_) : std::floor(b_);
        if (!(std::fabs(down) < 65536 && std::fabs(right) < 65536)) return 0;
        return ptrdiff_t(down) * srcStep + ptrdiff_t(right) * pixelBytes;
    }

    static constexpr int kTile = 128;

private:
    static constexpr double kReach = 1073741824.0;  // 2^30

    // A row's run [lo, hi) as the column table plus (pu, pv), with the
    // columns [inLo, inHi) that need no clamping; rows whose terms are out
    // of the table's reach are written pixel by pixel here and left empty.
    struct Span {
        int lo, hi, inLo, inHi;
        int64_t pu, pv;
        const int64_t *du, *dv;  // indexed by column
    };
    Span spanOf(int y, RunWriter& out) const {
        Span r{0, 0, 0, 0, 0, 0, nullptr, nullptr};
        const double ru = b_ * y + c_, rv = e_ * y + f_;
        int lo = x0_, hi = x0_ + n_;
        narrowToRange(lo, hi, a_ >= 0, 0.0, double(width_ - 1), [&](int x) { return a_ * x + ru; });
        narrowToRange(lo, hi, d_ >= 0, 0.0, double(height_ - 1), [&](int x) { return d_ * x + rv; });
        if (lo >= hi) return r;
        if (!table_ || !(std::fabs(ru) < kReach && std::fabs(rv) < kReach)) {
            out.startRow(y);
            for (int x = lo; x < hi; ++x) out.add(x, toFixed(a_ * x + ru), toFixed(d_ * x + rv));
            out.flush();
            return r;
        }
        r.pu = toFixed(ru), r.pv = toFixed(rv);
        r.du = table_ - x0_, r.dv = table_ + n_ + kSlack - x0_;
        int inLo = lo, inHi = hi;
        if (out.clamps()) {
            narrowToRange(inLo, inHi, a_ >= 0, int64_t(0), out.xLimit(), [&](int x) { return r.pu + r.du[x]; });
            narrowToRange(inLo, inHi, d_ >= 0, int64_t(0), out.yLimit(), [&](int x) { return r.pv + r.dv[x]; });
        }
        r.lo = lo, r.hi = hi, r.inLo = inLo, r.inHi = inHi;
        return r;
    }

    const double a_, b_, c_, d_, e_, f_;
    const int width_, height_, x0_, n_;
    int64_t* table_ = nullptr;  // a x for the n_ columns, kSlack spare, then d x
};

// ---- the perspective and bilinear maps: pixel by pixel ---------------------------------

// Source point (u, v) relative to the clipped source ROI of pixel (x, y),
// written into the run when it lies in the ROI.
template <class Invert>
void rowByPixels(const Clipped& c, int y, RunWriter& out, Invert invert) {
    out.startRow(y);
    const double right = c.src.width - 1, bottom = c.src.height - 1;
    for (int x = c.dst.x; x < c.dst.x + c.dst.width; ++x) {
        double u, v;
        if (invert(x, y, u, v) && u >= 0 && u <= right && v >= 0 && v <= bottom)
            out.add(x, toFixed(u), toFixed(v));
    }
    out.flush();
}

// The perspective map inverted through the adjugate of its matrix (the
// inverse up to scale): source points relative to the clipped ROI origin.
class PerspectiveInverse {
public:
    // False when the coefficients are not finite or singular.
    bool invert(const double c[3][3]) {
        if (!allFinite<9>(&c[0][0])) return false;
        for (int i = 0; i < 3; ++i)
            for (int j = 0; j < 3; ++j) {
                const int r0 = (j + 1) % 3, r1 = (j + 2) % 3, c0 = (i + 1) % 3, c1 = (i + 2) % 3;
                m_[i][j] = c[r0][c0] * c[r1][c1] - c[r0][c1] * c[r1][c0];
            }
        const double det = c[0][0] * m_[0][0] + c[0][1] * m_[1][0] + c[0][2] * m_[2][0];
        return det != 0 && std::isfinite(det) && allFinite<9>(&m_[0][0]);
    }
    void from(const Clipped& c) { sx_ = c.src.x, sy_ = c.src.y; }

    bool operator()(int x, int y, double& u, double& v) const {
        const double w = m_[2][0] * x + m_[2][1] * y + m_[2][2];
        u = (m_[0][0] * x + m_[0][1] * y + m_[0][2]) / w - sx_;
        v = (m_[1][0] * x + m_[1][1] * y + m_[1][2]) / w - sy_;
        return w != 0;
    }

private:
    double m_[3][3], sx_ = 0, sy_ = 0;
};

inline double cross(double ax, double ay, double bx, double by) { return ax * by - ay * bx; }

// x' = c00 x y + c01 x + c02 y + c03 (and y') about the clipped ROI origin
// (sx, sy): F(sx + u, sy + v) = p + e u + f v + g u v.  A destination point
// q gives h = q - p = e u + f v + g u v, so (h - f v) x (e + g v) = 0: a
// quadratic in v, then u from h - f v = u (e + g v).
class BilinearInverse {
public:
    BilinearInverse(const double c[2][4], const Clipped& clip) : bottom_(clip.src.height - 1) {
        const double sx = clip.src.x, sy = clip.src.y;
        for (int k = 0; k < 2; ++k) {
            p_[k] = c[k][0] * sx * sy + c[k][1] * sx + c[k][2] * sy + c[k][3];
            e_[k] = c[k][0] * sy + c[k][1];
            f_[k] = c[k][0] * sx + c[k][2];
            g_[k] = c[k][0];
        }
        a2_ = -cross(f_[0], f_[1], g_[0], g_[1]);
        fe_ = cross(f_[0], f_[1], e_[0], e_[1]);
    }

    // The root with v in [0, bottom] first, its u from the better
    // conditioned coordinate; false without one.
    bool operator()(int x, int y, double& u, double& v) const {
        const double hx = x - p_[0], hy = y - p_[1];
        const double a1 = cross(hx, hy, g_[0], g_[1]) - fe_, a0 = cross(hx, hy, e_[0], e_[1]);
        double roots[2];
        int n = 0;
        if (a2_ == 0) {
            if (a1 == 0) return false;
            roots[n++] = -a0 / a1;
        } else {
            const double disc = a1 * a1 - 4 * a2_ * a0;
            if (!(disc >= 0)) return false;
            const double q = -0.5 * (a1 + std::copysign(std::sqrt(disc), a1));
            roots[n++] = q / a2_;
            if (q != 0) roots[n++] = a0 / q;
        }
        for (int k = 0; k < n; ++k) {
            const double r = roots[k];
            if (!(r >= 0 && r <= bottom_)) continue;
            const double dx = e_[0] + g_[0] * r, dy = e_[1] + g_[1] * r;
            const double t = std::fabs(dx) >= std::fabs(dy) ? (hx - f_[0] * r) / dx : (hy - f_[1] * r) / dy;
            if (std::isfinite(t)) {
                u = t, v = r;
                return true;
            }
        }
        return false;
    }

private:
    double p_[2], e_[2], f_[2], g_[2], a2_, fe_, bottom_;
};

// The Jacobian determinant of the bilinear map has one strict sign at the
// four corners of roi (so on all of it, being affine in x and y).
bool bilinearOneToOne(const double c[2][4], ImageRect roi) {
    if (!allFinite<8>(&c[0][0])) return false;
    const double xs[2] = {double(roi.x), double(roi.x) + roi.width - 1};
    const double ys[2] = {double(roi.y), double(roi.y) + roi.height - 1};
    int positive = 0, negative = 0;
    for (double x : xs)
        for (double y : ys) {
            const double j = (c[0][0] * y + c[0][1]) * (c[1][0] * x + c[1][2]) -
                             (c[0][0] * x + c[0][2]) * (c[1][0] * y + c[1][1]);
            positive += j > 0;
            negative += j < 0;
        }
    return positive == 4 || negative == 4;
}

// ---- composition ---------------------------------------------------------------------------

template <class T, int C>
constexpr int kPixelBytes = int(sizeof(T)) * C;

// Runs a checked warp over the clipped ROIs: rows(y0, y1, writer) writes
// the rows [y0, y1), kBand at a time (nextRow: see Source).
template <class T, int C, class Rows>
void warpRows(const Clipped& c, const void* pSrc, int srcStep, void* pDst, int dstStep, int interpolation,
              ptrdiff_t nextRow, Rows rows) {
    const uint8_t* origin = static_cast<const uint8_t*>(pSrc) + ptrdiff_t(c.src.y) * srcStep;
    const Source src{origin + ptrdiff_t(c.src.x) * kPixelBytes<T, C>, srcStep, c.src.width, c.src.height, nextRow};
    const bool wide = c.src.width > 1 && c.src.height > 1;
    const bool clamps = std::is_same_v<T, uint8_t> && interpolation == InterLinear;
    RunWriter out(src, sampleRunFor<T, C>(interpolation, wide), clamps, static_cast<uint8_t*>(pDst), dstStep,
                  kPixelBytes<T, C>);
    const int end = c.dst.y + c.dst.height;
    for (int y = c.dst.y; y < end; y += kBand) rows(y, std::min(end, y + kBand), out);
}

template <class T, int C>
Status warpAffine(const void* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, void* pDst, int dstStep,
                  ImageRect dstRoi, const double coeffs[2][3], int interpolation) {
    if (Status s = checkImages(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation))
        return s;
    DoublePrecisionScope precision;
    double inv[2][3];
    if (!invertAffine(coeffs, inv)) return StatusBadArgument;
    Clipped c;
    if (!clipRois(srcSize, srcRoi, dstRoi, c)) return StatusWarnNoOperation;
    AffineRows map(inv, c);
    if (!map.prepare()) return StatusNoMemory;
    warpRows<T, C>(c, pSrc, srcStep, pDst, dstStep, interpolation, map.nextRow(srcStep, kPixelBytes<T, C>),
                   [&](int y0, int y1, RunWriter& out) { map.rows(y0, y1, out); });
    return StatusOk;
}

template <int C, class Invert>
void warpByPixels(const Clipped& c, const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep, int interpolation,
                  const Invert& invert) {
    warpRows<uint8_t, C>(c, pSrc, srcStep, pDst, dstStep, interpolation, 0, [&](int y0, int y1, RunWriter& out) {
        for (int y = y0; y < y1; ++y) rowByPixels(c, y, out, invert);
    });
}

template <int C>
Status warpPerspective(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst,
                       int dstStep, ImageRect dstRoi, const double coeffs[3][3], int interpolation) {
    if (Status s = checkImages(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation))
        return s;
    DoublePrecisionScope precision;
    PerspectiveInverse invert;
    if (!invert.invert(coeffs)) return StatusBadArgument;
    Clipped c;
    if (!clipRois(srcSize, srcRoi, dstRoi, c)) return StatusWarnNoOperation;
    invert.from(c);
    warpByPixels<C>(c, pSrc, srcStep, pDst, dstStep, interpolation, invert);
    return StatusOk;
}

template <int C>
Status warpBilinear(const uint8_t* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, uint8_t* pDst,
                    int dstStep, ImageRect dstRoi, const double coeffs[2][4], int interpolation) {
    if (Status s = checkImages(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation))
        return s;
    DoublePrecisionScope precision;
    if (!bilinearOneToOne(coeffs, srcRoi)) return StatusBadArgument;
    Clipped c;
    if (!clipRois(srcSize, srcRoi, dstRoi, c)) return StatusWarnNoOperation;
    warpByPixels<C>(c, pSrc, srcStep, pDst, dstStep, interpolation, BilinearInverse(coeffs, c));
    return StatusOk;
}

}  // namespace

// ---- the warps ---------------------------------------------------------------------------
#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)

Status warpAffineImage(WarpPixels pixels, const void* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi,
                       void* pDst, int dstStep, ImageRect dstRoi, const double coeffs[2][3], int interpolation) {
    switch (pixels) {
    case WarpPixels::u8C1:
        return warpAffine<uint8_t, 1>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
    case WarpPixels::u8C3:
        return warpAffine<uint8_t, 3>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
    case WarpPixels::u16C1:
        return warpAffine<uint16_t, 1>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
    case WarpPixels::u16C3:
        return warpAffine<uint16_t, 3>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
    case WarpPixels::f32C3:
        return warpAffine<float, 3>(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);
    }
    return StatusBadArgument;
}

#define ZOR_WARP(name, T, dims, warp)                                                                         \
    Status ZOR_CALL name(const T* pSrc, ImageSize srcSize, int srcStep, ImageRect srcRoi, T* pDst, int dstStep,    \
                         ImageRect dstRoi, const double coeffs dims, int interpolation) {                        \
        return warp(pSrc, srcSize, srcStep, srcRoi, pDst, dstStep, dstRoi, coeffs, interpolation);             \
    }
ZOR_WARP(zoriWarpAffine_8u_C1R, uint8_t, [2][3], (warpAffine<uint8_t, 1>))
ZOR_WARP(zoriWarpAffine_8u_C3R, uint8_t, [2][3], (warpAffine<uint8_t, 3>))
ZOR_WARP(zoriWarpAffine_8u_C4R, uint8_t, [2][3], (warpAffine<uint8_t, 4>))
ZOR_WARP(zoriWarpAffine_32f_C1R, float, [2][3], (warpAffine<float, 1>))
ZOR_WARP(zoriWarpAffine_32f_C3R, float, [2][3], (warpAffine<float, 3>))
ZOR_WARP(zoriWarpBilinear_8u_C1R, uint8_t, [2][4], warpBilinear<1>)
ZOR_WARP(zoriWarpBilinear_8u_C3R, uint8_t, [2][4], warpBilinear<3>)
ZOR_WARP(zoriWarpPerspective_8u_C1R, uint8_t, [3][3], warpPerspective<1>)
ZOR_WARP(zoriWarpPerspective_8u_C3R, uint8_t, [3][3], warpPerspective<3>)
#undef ZOR_WARP

#endif

// ---- coefficients and bounds -------------------------------------------------------------
#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)

namespace {

// The four corners of a ROI, clockwise from the top left.
struct Corners {
    double x[4], y[4];
    explicit Corners(ImageRect r) {
        const double x0 = r.x, y0 = r.y, x1 = x0 + r.width - 1, y1 = y0 + r.height - 1;
        x[0] = x0, x[1] = x1, x[2] = x1, x[3] = x0;
        y[0] = y0, y[1] = y0, y[2] = y1, y[3] = y1;
    }
};

// A quad that a ROI may map to: finite, convex, no three points on a line.
bool convexQuad(const double q[4][2]) {
    if (!allFinite<8>(&q[0][0])) return false;
    int positive = 0, negative = 0;
    for (int i = 0; i < 4; ++i) {
        const double* a = q[i];
        const double* b = q[(i + 1) % 4];
        const double* c = q[(i + 2) % 4];
        const double turn = cross(b[0] - a[0], b[1] - a[1], c[0] - b[0], c[1] - b[1]);
        positive += turn > 0;
        negative += turn < 0;
    }
    return positive == 4 || negative == 4;
}

// The checks of the transform helpers, in order.
Status checkQuad(ImageRect srcRoi, const double quad[4][2], const void* coeffs) {
    if (Status s = checkFirst(anyNull(quad, coeffs), badRoi(ImageSize{srcRoi.width, srcRoi.height}))) return s;
    if (srcRoi.width == 1 || srcRoi.height == 1 || !convexQuad(quad)) return StatusBadArgument;
    return StatusOk;
}

}  // namespace

Status ZOR_CALL zoriGetAffineBound(ImageRect srcRoi, double bound[2][2], const double coeffs[2][3]) {
    if (Status s = checkFirst(anyNull(bound, coeffs), badRoi(ImageSize{srcRoi.width, srcRoi.height}))) return s;
    DoublePrecisionScope precision;
    double inv[2][3];
    if (!invertAffine(coeffs, inv)) return StatusBadArgument;
    const Corners k(srcRoi);
    double lo[2] = {INFINITY, INFINITY}, hi[2] = {-INFINITY, -INFINITY};
    for (int i = 0; i < 4; ++i)
        for (int r = 0; r < 2; ++r) {
            const double v = coeffs[r][0] * k.x[i] + coeffs[r][1] * k.y[i] + coeffs[r][2];
            lo[r] = std::min(lo[r], v);
            hi[r] = std::max(hi[r], v);
        }
    bound[0][0] = lo[0], bound[0][1] = lo[1], bound[1][0] = hi[0], bound[1][1] = hi[1];
    return StatusOk;
}

Status ZOR_CALL zoriGetAffineTransform(ImageRect srcRoi, const double quad[4][2], double coeffs[2][3]) {
    if (Status s = checkQuad(srcRoi, quad, coeffs)) return s;
    DoublePrecisionScope precision;
    double lo[2] = {quad[0][0], quad[0][1]}, hi[2] = {lo[0], lo[1]};
    for (int i = 1; i < 4; ++i)
        for (int r = 0; r < 2; ++r) lo[r] = std::min(lo[r], quad[i][r]), hi[r] = std::max(hi[r], quad[i][r]);
    const double extent = std::max(hi[0] - lo[0], hi[1] - lo[1]);
    for (int r = 0; r < 2; ++r)  // the parallelogram's fourth point
        if (!(std::fabs(quad[0][r] + quad[2][r] - quad[1][r] - quad[3][r]) <= 1e-9 * extent))
            return StatusBadArgument;
    const double w = srcRoi.width - 1, h = srcRoi.height - 1;
    for (int r = 0; r < 2; ++r) {
        const double cx = (quad[1][r] - quad[0][r]) / w, cy = (quad[2][r] - quad[1][r]) / h;
        coeffs[r][0] = cx;
        coeffs[r][1] = cy;
        coeffs[r][2] = quad[0][r] - cx * srcRoi.x - cy * srcRoi.y;
    }
    return StatusOk;
}

// With u = (x - x0) / w, v = (y - y0) / h over the ROI:
//   F = q0 + (q1 - q0) u + (q3 - q0) v + (q0 - q1 + q2 - q3) u v, expanded in x and y.
Status ZOR_CALL zoriGetBilinearTransform(ImageRect srcRoi, const double quad[4][2], double coeffs[2][4]) {
    if (Status s = checkQuad(srcRoi, quad, coeffs)) return s;
    DoublePrecisionScope precision;
    const double x0 = srcRoi.x, y0 = srcRoi.y, w = srcRoi.width - 1, h = srcRoi.height - 1;
    for (int r = 0; r < 2; ++r) {
        const double a = quad[0][r], b = (quad[1][r] - quad[0][r]) / w, c = (quad[3][r] - quad[0][r]) / h;
        const double d = (quad[0][r] - quad[1][r] + quad[2][r] - quad[3][r]) / (w * h);
        coeffs[r][0] = d;
        coeffs[r][1] = b - d * y0;
        coeffs[r][2] = c - d * x0;
        coeffs[r][3] = a - b * x0 - c * y0 + d * x0 * y0;
    }
    return StatusOk;
}

// The unit square to the quad (corners (0,0), (1,0), (1,1), (0,1)):
//   x' = (a u + b v + c) / (g u + h v + 1), y' = (d u + e v + f) / (g u + h v + 1),
// then u = (x - x0) / w, v = (y - y0) / h.
Status ZOR_CALL zoriGetPerspectiveTransform(ImageRect srcRoi, const double quad[4][2], double coeffs[3][3]) {
    if (Status s = checkQuad(srcRoi, quad, coeffs)) return s;
    DoublePrecisionScope precision;
    const double sx = quad[0][0] - quad[1][0] + quad[2][0] - quad[3][0];
    const double sy = quad[0][1] - quad[1][1] + quad[2][1] - quad[3][1];
    double g = 0, h = 0;
    if (sx != 0 || sy != 0) {
        const double dx1 = quad[1][0] - quad[2][0], dx2 = quad[3][0] - quad[2][0];
        const double dy1 = quad[1][1] - quad[2][1], dy2 = quad[3][1] - quad[2][1];
        const double den = cross(dx1, dy1, dx2, dy2);  // non-zero for a convex quad
        g = cross(sx, sy, dx2, dy2) / den;
        h = cross(dx1, dy1, sx, sy) / den;
    }
    double m[3][3] = {{0, 0, 0}, {0, 0, 0}, {g, h, 1}};
    for (int r = 0; r < 2; ++r) {
        m[r][0] = quad[1][r] - quad[0][r] + g * quad[1][r];
        m[r][1] = quad[3][r] - quad[0][r] + h * quad[3][r];
        m[r][2] = quad[0][r];
    }
    const double x0 = srcRoi.x, y0 = srcRoi.y, w = srcRoi.width - 1, hh = srcRoi.height - 1;
    double out[3][3];
    for (int r = 0; r < 3; ++r) {
        out[r][0] = m[r][0] / w;
        out[r][1] = m[r][1] / hh;
        out[r][2] = m[r][2] - out[r][0] * x0 - out[r][1] * y0;
    }
    if (!allFinite<9>(&out[0][0])) return StatusBadArgument;
    std::copy(&out[0][0], &out[0][0] + 9, &coeffs[0][0]);
    return StatusOk;
}

#endif

}}  // namespace zor::ZOR_NS

#endif
