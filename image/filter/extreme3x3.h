// 3x3 maximum / minimum of 8-bit rows, shared by the rank filters and the
// morphology.  Include after frame/variant.h.
#pragma once

#include "frame/abi.h"

#include <cstddef>
#include <cstdint>

namespace zor { inline namespace ZOR_INLINE_NS {

struct Max8u {
    static uint8_t pick(uint8_t a, uint8_t b) { return a > b ? a : b; }
#if ZOR_SIMD >= 2
    static __m128i pick(__m128i a, __m128i b) { return _mm_max_epu8(a, b); }
#endif
};
struct Min8u {
    static uint8_t pick(uint8_t a, uint8_t b) { return a < b ? a : b; }
#if ZOR_SIMD >= 2
    static __m128i pick(__m128i a, __m128i b) { return _mm_min_epu8(a, b); }
#endif
};

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
    auto ld = [](const uint8_t* p) { return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p)); };
    auto column = [&](int at) { return Op::pick(Op::pick(ld(r0 + at), ld(r1 + at)), ld(r2 + at)); };
#  if ZOR_SIMD >= 4
    // column picks of each block once; the shifted ones come from the next block
    if (w >= 32) {
        __m128i cur = column(0);
        for (; x + 32 <= w + 2; x += 16) {  // reads up to column x + 31
            const __m128i next = column(x + 16);
            const __m128i v = Op::pick(Op::pick(cur, _mm_alignr_epi8(next, cur, 1)),
                                       _mm_alignr_epi8(next, cur, 2));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), v);
            cur = next;
        }
    }
#  endif
    if (w >= 16) {
        for (; x < w; x += 16) {
            if (x + 16 > w) x = w - 16;  // the last block overlaps
            const __m128i v = Op::pick(Op::pick(column(x), column(x + 1)), column(x + 2));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(out + x), v);
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
