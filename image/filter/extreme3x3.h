// Maximum and minimum picks, and the 3x3 maximum / minimum of 8-bit rows,
// shared by the rank filters and the morphology.  Include after
// frame/variant.h.
#pragma once

#include "frame/abi.h"
#include "frame/simd.h"

#include <cstddef>
#include <cstdint>

namespace zor { inline namespace ZOR_INLINE_NS {

// The larger (smaller) of a kept value a and a new one b, on single lanes
// and on registers: b replaces a only when strictly larger (smaller), so a
// float NaN already picked stays.
struct PickMax {
    template <class V>
    static V pick(V a, V b) { return simd::max(b, a); }
};
struct PickMin {
    template <class V>
    static V pick(V a, V b) { return simd::min(b, a); }
};

#if ZOR_SIMD >= 2
// The picks down a column of three rows, a register of columns from `at`.
template <class V, class Op>
inline V pickDown3(const uint8_t* r0, const uint8_t* r1, const uint8_t* r2, int at) {
    using simd::load;
    return Op::pick(Op::pick(load<V>(r0 + at), load<V>(r1 + at)), load<V>(r2 + at));
}
#endif

// out[x] = pick over rows t, t + step, t + 2 step and columns x .. x + 2 of
// t (the neighbourhood's top-left pixel), for x in 0 .. w - 1; reads nothing
// beyond column w + 1.
template <class Op>
void extreme3x3Row(const uint8_t* t, ptrdiff_t step, uint8_t* out, int w) {
    const uint8_t* r0 = t;
    const uint8_t* r1 = t + step;
    const uint8_t* r2 = t + 2 * step;
    int x = 0;
#if ZOR_SIMD >= 2
    using namespace simd;
#  if ZOR_SIMD >= 4
    // column picks of each block once; the shifted ones come from the next
    // block (the shifts reach across one 16-byte register)
    using B = Vec<uint8_t, 16>;
    if (w >= 32) {
        B cur = pickDown3<B, Op>(r0, r1, r2, 0);
        for (; x + 32 <= w + 2; x += 16) {  // reads up to column x + 31
            const B next = pickDown3<B, Op>(r0, r1, r2, x + 16);
            store(out + x, Op::pick(Op::pick(cur, alignBytes<1>(next, cur)), alignBytes<2>(next, cur)));
            cur = next;
        }
    }
#  endif
    using V = Vec<uint8_t>;
    if (w >= V::kLanes) {
        const auto column = [&](int at) { return pickDown3<V, Op>(r0, r1, r2, at); };
        for (; x < w; x += V::kLanes) {
            if (x + V::kLanes > w) x = w - V::kLanes;  // the last block overlaps
            store(out + x, Op::pick(Op::pick(column(x), column(x + 1)), column(x + 2)));
        }
        return;
    }
#endif
    for (; x < w; ++x) {
        uint8_t v = r0[x];
        for (int i = 0; i < 3; ++i) v = Op::pick(Op::pick(Op::pick(v, r0[x + i]), r1[x + i]), r2[x + i]);
        out[x] = v;
    }
}

}}  // namespace zor::ZOR_INLINE_NS
