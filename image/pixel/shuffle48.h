// Byte permutations of 48-byte blocks (sixteen three-byte or eight six-byte
// pixels in three 16-byte registers) and the alpha bytes of four-element
// pixels, shared by the pixel movers.
//
// Include after frame/variant.h.
#pragma once

#include <cstdint>

#include "frame/abi.h"
#include "frame/simd.h"

namespace zor { inline namespace ZOR_INLINE_NS {

#if ZOR_SIMD >= 2
// The byte permutations work on 16-byte registers (pshufb's reach).
using Bytes16 = simd::Vec<uint8_t, 16>;

// The alpha bytes (the fourth element) of four-element pixels of E-byte
// elements (E = 1 or 2), set, in a register of B bytes.
template <int E, int B = simd::kNativeBytes>
inline simd::Vec<uint8_t, B> alphaBytes() {
    using namespace simd;
    if constexpr (E == 1) return bitcast<uint8_t>(set1<Vec<uint32_t, B>>(0xFF000000u));
    else return bitcast<uint8_t>(set1<Vec<uint64_t, B>>(0xFFFF000000000000ull));
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
    static inline void apply(const Bytes16 (&in)[3], Bytes16 (&out)[3]) {
        using namespace simd;
        for (int o = 0; o < 3; ++o) {
            Bytes16 acc = zero<Bytes16>();
            for (int r = 0; r < 3; ++r)
                if (t.used[o][r]) acc = acc | shuffleBytes(in[r], loadAligned<Bytes16>(t.mask[o][r]));
            out[o] = acc;
        }
    }
};
#endif

}}  // namespace zor::ZOR_INLINE_NS
