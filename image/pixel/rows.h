// Row addressing and byte-shuffle building blocks shared by the pixel movers
// (image/pixel/copy, image/pixel/convert, image/geometry/mirror).
//
// Include after frame/variant.h: the SIMD helpers follow ZOR_SIMD.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>

#include "frame/abi.h"
#include "frame/row_address.h"
#include "zor.h"

namespace zor { inline namespace ZOR_INLINE_NS {

// A region whose rows follow each other without gaps on every side is one
// long row: rowsOf() gives the elements per row to process and the number of
// rows, either width * channels and height, or everything and 1.
struct Rows {
    ptrdiff_t elems;  // elements (channels included) of the reference side per row
    int count;        // rows
};

inline Rows rowsOf(ImageSize roi, int channels, bool contiguous) {
    if (contiguous && roi.height > 1)
        return {static_cast<ptrdiff_t>(roi.width) * channels * roi.height, 1};
    return {static_cast<ptrdiff_t>(roi.width) * channels, roi.height};
}

// True when step equals the bytes of one row (width * bytesPerPixel).
inline bool packed(int step, ImageSize roi, int bytesPerPixel) {
    return static_cast<int64_t>(step) == static_cast<int64_t>(roi.width) * bytesPerPixel;
}

// Calls block(x) for x = 0, Block, 2 Block, ... while a whole block fits in
// n and returns where it stopped.  Two blocks per iteration: half the loop
// overhead, and the loads of the next block are issued before the stores of
// this one have to wait for their cache lines.
template <ptrdiff_t Block, class F>
inline ptrdiff_t eachBlock(ptrdiff_t n, F&& block) {
    ptrdiff_t x = 0;
    for (; x + 2 * Block <= n; x += 2 * Block) {
        block(x);
        block(x + Block);
    }
    if (x + Block <= n) {
        block(x);
        x += Block;
    }
    return x;
}

#if ZOR_SIMD >= 2
inline __m128i load16(const void* p) { return _mm_loadu_si128(static_cast<const __m128i*>(p)); }
inline void store16(void* p, __m128i v) { _mm_storeu_si128(static_cast<__m128i*>(p), v); }
inline void load48(const void* p, __m128i (&v)[3]) {
    const uint8_t* b = static_cast<const uint8_t*>(p);
    v[0] = load16(b);
    v[1] = load16(b + 16);
    v[2] = load16(b + 32);
}
inline void store48(void* p, const __m128i (&v)[3]) {
    uint8_t* b = static_cast<uint8_t*>(p);
    store16(b, v[0]);
    store16(b + 16, v[1]);
    store16(b + 32, v[2]);
}
// Keeps the bytes of `keep` where mask is set, takes `fresh` elsewhere.
inline __m128i blend16(__m128i fresh, __m128i keep, __m128i mask) {
    return _mm_or_si128(_mm_and_si128(mask, keep), _mm_andnot_si128(mask, fresh));
}
// The alpha bytes of four-element pixels of E-byte elements (E = 1 or 2).
template <int E>
inline __m128i alphaBytes() {
    if constexpr (E == 1) return _mm_set1_epi32(static_cast<int>(0xFF000000u));
    else return _mm_set_epi32(static_cast<int>(0xFFFF0000u), 0, static_cast<int>(0xFFFF0000u), 0);
}
#endif

#if ZOR_SIMD >= 4
// A fixed permutation of a 48-byte block held in three registers: output
// byte j comes from input byte Map::src(j) (0..47).  Each output register is
// the OR of one shuffle per input register that feeds it; the table records
// which pairs are empty so that they cost nothing.
struct Shuffle48Table {
    alignas(16) uint8_t mask[3][3][16];
    bool used[3][3];
};

template <class Map>
constexpr Shuffle48Table makeShuffle48() {
    Shuffle48Table t{};
    for (int o = 0; o < 3; ++o)
        for (int r = 0; r < 3; ++r) {
            t.used[o][r] = false;
            for (int lane = 0; lane < 16; ++lane) {
                const int s = Map::src(o * 16 + lane);
                const bool mine = s / 16 == r;
                t.mask[o][r][lane] = mine ? static_cast<uint8_t>(s % 16) : uint8_t(0x80);
                t.used[o][r] = t.used[o][r] || mine;
            }
        }
    return t;
}

template <class Map>
struct Shuffle48 {
    static constexpr Shuffle48Table t = makeShuffle48<Map>();
    static inline void apply(const __m128i (&in)[3], __m128i (&out)[3]) {
        for (int o = 0; o < 3; ++o) {
            __m128i acc = _mm_setzero_si128();
            for (int r = 0; r < 3; ++r)
                if (t.used[o][r])
                    acc = _mm_or_si128(acc, _mm_shuffle_epi8(in[r], _mm_load_si128(
                                                                    reinterpret_cast<const __m128i*>(t.mask[o][r]))));
            out[o] = acc;
        }
    }
};

#endif

}}  // namespace zor::ZOR_INLINE_NS
