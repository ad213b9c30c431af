// Spatial moments up to order 3 of a float image, kept in a MomentState.
//
// A row y contributes its row sums S0 = sum f, S1 = sum x f, S2 = sum x^2 f,
// S3 = sum x^3 f, formed in double with the terms x f, x (x f), x (x (x f))
// (x the column within the ROI).  Each row sum runs in four partial sums,
// column x into partial x mod 4, combined as (p0 + p2) + (p1 + p3) at the end
// of the row: two double lanes of two registers, so the SIMD variants add
// in exactly the generic order.  The grid then gains
//   M00 += S0, M10 += S1, M20 += S2, M30 += S3,
//   M01 += S0 y, M11 += S1 y, M21 += S2 y, M02 += S0 y y, M12 += S1 y y,
//   M03 += S0 y y y
// with the powers of y formed by repeated multiplication of the row term.
#include "frame/variant.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

constexpr int kPartials = 4;
constexpr int kOrders = 4;  // x^0 .. x^3

// Grid index of the moment of x-order m and y-order n.
constexpr int at(int m, int n) { return m + 4 * n; }

[[maybe_unused]] Status checkState(const MomentState* state) {
    return state->id == MomentStateId ? StatusOk : StatusContextMismatch;
}

struct RowSums {
    double s[kOrders];
};

// Adds columns x .. w - 1 of row f to the partial sums p[order][x mod 4].
[[maybe_unused]] void addColumns(const float* f, int x, int w, double (*p)[kPartials]) {
    for (; x < w; ++x) {
        const double xd = x;
        double t = f[x];
        for (int m = 0; m < kOrders; ++m) {
            if (m > 0) t = xd * t;
            p[m][x % kPartials] += t;
        }
    }
}

#if ZOR_SIMD >= 2
using F = simd::Vec<float>;
using D = simd::Vec<double>;
static_assert(F::kLanes == kPartials && 2 * D::kLanes == kPartials, "one float register widens into the four partials");

// Adds the columns 0 .. end - 1 (end a multiple of 4) to the partial sums of
// every order: acc[0] holds partials 0 and 1, acc[1] partials 2 and 3, of
// the halves chosen.
template <bool Lo, bool Hi>
void addRegisterColumns(const float* f, int end, D (&acc)[2][kOrders]) {
    const float first[4] = {0.0f, 1.0f, 2.0f, 3.0f};
    const F columns = simd::load<F>(first);
    D xlo = simd::widenLo(columns), xhi = simd::widenHi(columns);
    const D step = simd::set1<D>(double(kPartials));
    for (int x = 0; x < end; x += kPartials) {
        const F v = simd::load<F>(f + x);
        if constexpr (Lo) {
            D t = simd::widenLo(v);
            acc[0][0] += t;
            for (int m = 1; m < kOrders; ++m) acc[0][m] += (t = xlo * t);
            xlo += step;
        }
        if constexpr (Hi) {
            D t = simd::widenHi(v);
            acc[1][0] += t;
            for (int m = 1; m < kOrders; ++m) acc[1][m] += (t = xhi * t);
            xhi += step;
        }
    }
}
#endif

[[maybe_unused]] RowSums rowSums(const float* f, int w) {
    double p[kOrders][kPartials] = {};
    int x = 0;
#if ZOR_SIMD >= 2
    if (w >= kPartials) {
        x = w - w % kPartials;
        D acc[2][kOrders];
        for (int m = 0; m < kOrders; ++m) acc[0][m] = acc[1][m] = simd::zero<D>();
#if defined(__x86_64__)
        addRegisterColumns<true, true>(f, x, acc);
#else
        // eight accumulators and their operands do not fit the eight
        // registers of the 32-bit build: one half of the partials at a time
        // (the row is in the cache for the second pass)
        addRegisterColumns<true, false>(f, x, acc);
        addRegisterColumns<false, true>(f, x, acc);
#endif
        for (int m = 0; m < kOrders; ++m) {
            simd::store(p[m], acc[0][m]);
            simd::store(p[m] + 2, acc[1][m]);
        }
    }
#endif
    addColumns(f, x, w, p);
    RowSums r;
    for (int m = 0; m < kOrders; ++m) r.s[m] = (p[m][0] + p[m][2]) + (p[m][1] + p[m][3]);
    return r;
}

[[maybe_unused]] void addRow(double* g, const RowSums& r, double y) {
    g[at(0, 0)] += r.s[0];
    g[at(1, 0)] += r.s[1];
    g[at(2, 0)] += r.s[2];
    g[at(3, 0)] += r.s[3];
    double t0 = r.s[0] * y, t1 = r.s[1] * y;
    g[at(0, 1)] += t0;
    g[at(1, 1)] += t1;
    g[at(2, 1)] += r.s[2] * y;
    t0 *= y;
    t1 *= y;
    g[at(0, 2)] += t0;
    g[at(1, 2)] += t1;
    g[at(0, 3)] += t0 * y;
}

// C(k, i) x0^(k - i): the weight of the stored moment of order i in the
// moment of order k about a shifted origin.
[[maybe_unused]] double binomialWeight(int k, int i, double x0) {
    static const int kBinomial[4][4] = {{1, 0, 0, 0}, {1, 1, 0, 0}, {1, 2, 1, 0}, {1, 3, 3, 1}};
    double w = kBinomial[k][i];
    for (int e = i; e < k; ++e) w *= x0;
    return w;
}

}  // namespace

#if ZOR_DEFINES_ENTRIES_OF(ZOR_GENERIC)
Status ZOR_CALL zoriMomentInitAlloc_64f(MomentState** ppState, int hint) {
    if (!ppState) return StatusNullPointer;
    auto* state = static_cast<MomentState*>(mem::alignedAlloc(sizeof(MomentState)));
    if (!state) return StatusNoMemory;
    std::memset(state, 0, sizeof *state);
    state->id = MomentStateId;
    state->hint = hint;
    state->channels = -1;
    *ppState = state;
    return StatusOk;
}

Status ZOR_CALL zoriMomentFree_64f(MomentState* pState) {
    if (!pState) return StatusNullPointer;
    if (Status s = checkState(pState)) return s;
    mem::alignedFree(pState);
    return StatusOk;
}

// The moment about the origin moved to -roiOffset: the sum of
// (x + x0)^m (y + y0)^n f, expanded binomially over the stored moments,
// terms taken from the highest stored y-order down, and within it from the
// highest x-order down.  Orders must be m, n >= 0 with m + n <= 3.
Status ZOR_CALL zoriGetSpatialMoment_64f(const MomentState* pState, int mOrd, int nOrd, int nChannel,
                                         ImagePoint roiOffset, double* pValue) {
    if (Status s = anyNull(pState, pValue)) return s;
    if (Status s = checkState(pState)) return s;
    if (mOrd < 0 || nOrd < 0 || mOrd + nOrd > 3) return StatusBadSize;
    if (nChannel < 0 || nChannel >= pState->channels) return StatusBadChannelIndex;
    DoublePrecisionScope precision;
    const double* g = pState->moments[nChannel];
    const double x0 = roiOffset.x, y0 = roiOffset.y;
    double v = 0.0;
    bool first = true;
    for (int j = nOrd; j >= 0; --j)
        for (int i = mOrd; i >= 0; --i) {
            const double w = toDouble(binomialWeight(mOrd, i, x0) * binomialWeight(nOrd, j, y0));
            const double term = toDouble(w * g[at(i, j)]);  // the first weight is 1: exact
            v = first ? term : toDouble(v + term);
            first = false;
        }
    *pValue = v;
    return StatusOk;
}
#endif

#if ZOR_DEFINES_ENTRIES_OF(ZOR_SSE2UP)
// Checks the step before the size, then the step against the row.
Status ZOR_CALL zoriMoments64f_32f_C1R(const float* pSrc, int srcStep, ImageSize roiSize, MomentState* pState) {
    if (Status s = anyNull(pSrc, pState)) return s;
    if (Status s = checkState(pState)) return s;
    if (Status s = checkFirst(badSteps(srcStep), badRoi(roiSize))) return s;
    if (srcStep < 4 * roiSize.width) return StatusStepBelowRow;
    std::memset(pState->moments, 0, sizeof pState->moments);
    pState->channels = 1;
    DoublePrecisionScope precision;
    double* g = pState->moments[0];
    for (int y = 0; y < roiSize.height; ++y) addRow(g, rowSums(rowAt(pSrc, srcStep, y), roiSize.width), double(y));
    return StatusOk;
}
#endif

}}  // namespace zor::ZOR_NS
