// IIR filter of arbitrary order: transposed direct form II in double with
// the delay values kept as floats between samples, so that a signal split
// into blocks filters exactly as in one call.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/fpu.h"
#include "frame/memory.h"

#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

constexpr uint32_t kIdArbitrary = 0x49493031;
constexpr uint32_t kIdBiquads = 0x49493032;  // accepted by free; no creator here

struct IirState {
    uint32_t id;
    float* taps;       // b0 .. bN, a1 .. aN, normalised by a0
    float* delayLine;  // N values and one element fixed at 0
    int32_t order;
    int32_t reserved;
    int32_t allocated;
};

constexpr uint32_t up16(uint32_t b) { return (b + 15) & ~15u; }

// One sample: y = b0 x + d0; d_i = (b_(i+1) x - a_(i+1) y) + d_(i+1);
// d_(N-1) = b_N x - a_N y.  Every operation in double, in this order; the
// delay values are rounded to float after each sample.  N is fixed for the
// short filters (everything stays in registers), 0 for any order.
template <int N>
void filterRun(const float* taps, float* dly, int order, const float* src, float* dst, int len) {
    DoublePrecisionScope precision;
    if constexpr (N > 0) {
        double b[N + 1], a[N + 1], d[N];
        for (int i = 0; i <= N; ++i) b[i] = taps[i];
        for (int i = 1; i <= N; ++i) a[i] = taps[N + i];
        for (int i = 0; i < N; ++i) d[i] = dly[i];
        for (int j = 0; j < len; ++j) {
            const double x = src[j];
            const double y = toDouble(b[0] * x + d[0]);
            for (int i = 0; i < N - 1; ++i) d[i] = toFloat((b[i + 1] * x - a[i + 1] * y) + d[i + 1]);
            d[N - 1] = toFloat(b[N] * x - a[N] * y);
            dst[j] = toFloat(y);
        }
        for (int i = 0; i < N; ++i) dly[i] = static_cast<float>(d[i]);
    } else {
        const float* b = taps;
        const float* a = taps + order;  // a[i] for i = 1 .. N
        for (int j = 0; j < len; ++j) {
            const double x = src[j];
            const double y = toDouble(double(b[0]) * x + double(dly[0]));
            for (int i = 0; i < order - 1; ++i)
                dly[i] = toFloat((double(b[i + 1]) * x - double(a[i + 1]) * y) + double(dly[i + 1]));
            dly[order - 1] = toFloat(double(b[order]) * x - double(a[order]) * y);
            dst[j] = toFloat(y);
        }
    }
}

}  // namespace

Status ZOR_CALL zorsIIRInitAlloc_32f(void** ppState, const float* pTaps, int order,
                                     const float* pDlyLine) {
    if (Status s = anyNull(ppState, pTaps)) return s;
    if (order < 1) return StatusBadFilterOrder;
    const uint64_t head = up16(sizeof(IirState));
    const uint64_t tapBytes = ((uint64_t(2) * order + 1) * 4 + 15) / 16 * 16;
    const uint64_t dlyBytes = ((uint64_t(order) + 1) * 4 + 15) / 16 * 16;
    const uint64_t total = head + tapBytes + dlyBytes;
    if (total > 0x7FFFFFFF) return StatusNoMemory;
    uint8_t* block = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(total)));
    if (!block) return StatusNoMemory;
    IirState* st = reinterpret_cast<IirState*>(block);
    st->id = kIdArbitrary;
    st->taps = reinterpret_cast<float*>(block + head);
    st->delayLine = reinterpret_cast<float*>(block + head + tapBytes);
    st->order = order;
    st->reserved = 0;
    st->allocated = 1;

    const double a0 = pTaps[order + 1];
    if (!(a0 != 0.0) || a0 != a0) {  // zero or NaN
        mem::alignedFree(block);
        return StatusDivideByZero;
    }
    {
        DoublePrecisionScope precision;
        const double r = toDouble(1.0 / a0);
        for (int i = 0; i <= order; ++i) st->taps[i] = toFloat(pTaps[i] * r);
        for (int i = 1; i <= order; ++i) st->taps[order + i] = toFloat(pTaps[order + 1 + i] * r);
    }
    if (pDlyLine)
        std::memcpy(st->delayLine, pDlyLine, sizeof(float) * order);
    else
        std::memset(st->delayLine, 0, sizeof(float) * order);
    st->delayLine[order] = 0.0f;
    *ppState = st;
    return StatusOk;
}

Status ZOR_CALL zorsIIR_32f(const float* pSrc, float* pDst, int len, void* pState) {
    if (Status s = anyNull(pState, pSrc, pDst)) return s;
    if (len < 1) return StatusBadSize;
    IirState* st = static_cast<IirState*>(pState);
    // The biquad-cascade kind has no filtering path in this library.
    if (st->id != kIdArbitrary) return StatusContextMismatch;
    const float* t = st->taps;
    float* d = st->delayLine;
    switch (st->order) {
        case 1: filterRun<1>(t, d, 1, pSrc, pDst, len); break;
        case 2: filterRun<2>(t, d, 2, pSrc, pDst, len); break;
        case 3: filterRun<3>(t, d, 3, pSrc, pDst, len); break;
        case 4: filterRun<4>(t, d, 4, pSrc, pDst, len); break;
        case 5: filterRun<5>(t, d, 5, pSrc, pDst, len); break;
        case 6: filterRun<6>(t, d, 6, pSrc, pDst, len); break;
        case 7: filterRun<7>(t, d, 7, pSrc, pDst, len); break;
        case 8: filterRun<8>(t, d, 8, pSrc, pDst, len); break;
        default: filterRun<0>(t, d, st->order, pSrc, pDst, len); break;
    }
    return StatusOk;
}

Status ZOR_CALL zorsIIRFree_32f(void* pState) {
    if (!pState) return StatusNullPointer;
    IirState* st = static_cast<IirState*>(pState);
    if (st->id != kIdArbitrary && st->id != kIdBiquads) return StatusContextMismatch;
    if (st->allocated) {
        st->id = 0;
        mem::alignedFree(st);
    }
    return StatusOk;
}

}}  // namespace zor::ZOR_NS
