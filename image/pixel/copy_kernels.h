// Row kernels of the pixel movers that keep values (image/pixel/copy.cpp):
// element by element for every variant, and SIMD blocks beside them (fills
// from SSE2; layout changes, masked copies and channel orders as byte
// shuffles from SSSE3).  Each SIMD kernel returns the elements (or bytes)
// it did; the generic kernel finishes the row.  Included by copy.cpp only,
// after frame/variant.h.
#pragma once

#include "frame/simd.h"
#include "image/pixel/pixel_rows.h"
#include "image/pixel/shuffle48.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

// ---- generic row kernels ------------------------------------------------------

// Takes N consecutive elements of every source pixel (stride SC) into every
// destination pixel (stride DC); the destination's other elements stay.
template <class E, int SC, int DC, int N>
void pickRow(const E* s, E* d, ptrdiff_t n) {
    for (ptrdiff_t x = 0; x < n; ++x, s += SC, d += DC)
        for (int k = 0; k < N; ++k) d[k] = s[k];
}

template <class E, int C>
void splitRow(const E* s, E* const* planes, ptrdiff_t n) {
    for (int k = 0; k < C; ++k) {
        E* d = planes[k];
        const E* p = s + k;
        for (ptrdiff_t x = 0; x < n; ++x, p += C) d[x] = *p;
    }
}

template <class E, int C>
void mergeRow(const E* const* planes, E* d, ptrdiff_t n) {
    for (int k = 0; k < C; ++k) {
        const E* s = planes[k];
        E* p = d + k;
        for (ptrdiff_t x = 0; x < n; ++x, p += C) *p = s[x];
    }
}

template <class E>
void fillRow(E* d, ptrdiff_t n, E v) {
    for (ptrdiff_t x = 0; x < n; ++x) d[x] = v;
}

template <class E>
void fill3Row(E* d, ptrdiff_t n, const E (&v)[3]) {
    for (ptrdiff_t x = 0; x < n; ++x, d += 3) {
        d[0] = v[0];
        d[1] = v[1];
        d[2] = v[2];
    }
}

// Fills `bytes` bytes of a row with a pattern whose period divides
// kRepeatBytes: head(d, n) writes the first n bytes, the rest of the row is
// copies of them.  The copies come from the row's own start, still in the L1
// cache, and memcpy writes them with the widest stores the processor has,
// faster than the 16-byte stores of the pattern loops.
constexpr ptrdiff_t kRepeatBytes = 3072;  // 64 blocks of 48 bytes; a multiple of every pixel size
template <class Head>
void repeatFill(uint8_t* d, ptrdiff_t bytes, Head&& head) {
    const ptrdiff_t first = bytes < kRepeatBytes ? bytes : kRepeatBytes;
    head(d, first);
    for (ptrdiff_t i = first; i < bytes; i += first)
        std::memcpy(d + i, d, static_cast<size_t>(bytes - i < first ? bytes - i : first));
}

template <class E>
void swapRow(const E* s, E* d, ptrdiff_t n, int C, const int (&o)[3]) {
    for (ptrdiff_t x = 0; x < n; ++x, s += C, d += C) {
        // all three read before any is written: the in-place form relies on it
        const E a = s[o[0]], b = s[o[1]], c = s[o[2]];
        d[0] = a;
        d[1] = b;
        d[2] = c;
    }
}

// ---- SIMD row kernels ---------------------------------------------------------

#if ZOR_SIMD >= 2
// Repeats the pattern p (three registers: a whole number of pixels of three
// elements) over the first bytes of d; returns the bytes written (whole
// patterns).  Plain stores of registers held throughout beat copying the
// row's first bytes on with memcpy by about a sixth for outputs that stay
// in the last-level cache (1920 x 1080 pixels).
template <int B>
inline ptrdiff_t fillPattern3(uint8_t* d, ptrdiff_t bytes, const simd::Vec<uint8_t, B> (&p)[3]) {
    return eachBlock<3 * B>(bytes, [&](ptrdiff_t i) { simd::storeBlock(d + i, p); });
}

// Fills `bytes` bytes at d with repeats of a pattern of `period` bytes (a
// divisor of 48): its 16-byte aligned part with non-temporal stores (the
// caller fences after the last row), the bytes before and after it one by
// one.
inline void fillStreamed(uint8_t* d, ptrdiff_t bytes, const uint8_t* pattern, int period) {
    const ptrdiff_t head = std::min<ptrdiff_t>(bytes, static_cast<ptrdiff_t>((16 - (reinterpret_cast<uintptr_t>(d) & 15)) & 15));
    ptrdiff_t i = 0;
    for (; i < head; ++i) d[i] = pattern[i % period];
    alignas(16) uint8_t phased[48];
    for (int j = 0; j < 48; ++j) phased[j] = pattern[(head + j) % period];
    Bytes16 p[3];
    simd::loadBlock(phased, p);
    for (; i + 48 <= bytes; i += 48)
        for (int k = 0; k < 3; ++k) simd::stream(d + i + 16 * k, p[k]);
    for (; i < bytes; ++i) d[i] = pattern[i % period];
}

template <class E>
ptrdiff_t fillRowSimd(E* d, ptrdiff_t n, E v) {
    using V = simd::Vec<E>;
    const V p = simd::set1<V>(v);
    return eachBlock<V::kLanes>(n, [&](ptrdiff_t x) { simd::store(d + x, p); });
}
#endif

#if ZOR_SIMD >= 4
// Interleaved three channels <-> three planes, 48 bytes at a time.

// Bytes in registers wider than 16 bytes: the vocabulary's three-channel
// loads and stores (one 48-byte block per 16-byte lane).
template <class E>
constexpr bool kWideBytes = sizeof(E) == 1 && simd::kNativeBytes > 16;

// Twelve bytes of three-element pixels with each channel's elements
// gathered into one 32-bit lane (lane 3 is left empty).
template <int E>
inline Bytes16 groupChannels3() {
    if constexpr (E == 1) return simd::fromLanes<Bytes16>({0, 3, 6, 9, 1, 4, 7, 10, 2, 5, 8, 11, 0x80, 0x80, 0x80, 0x80});
    else return simd::fromLanes<Bytes16>({0, 1, 6, 7, 2, 3, 8, 9, 4, 5, 10, 11, 0x80, 0x80, 0x80, 0x80});
}
using Words4 = simd::Vec<uint32_t, 16>;

template <class E>
ptrdiff_t split3Simd(const E* s, E* const* planes, ptrdiff_t n) {
    E* p0 = planes[0];
    E* p1 = planes[1];
    E* p2 = planes[2];
    if constexpr (kWideBytes<E>) {
        using V = simd::Vec<uint8_t>;
        return eachBlock<V::kLanes>(n, [&](ptrdiff_t x) {
            V a, b, c;
            simd::loadInterleaved3(s + 3 * x, a, b, c);
            simd::store(p0 + x, a);
            simd::store(p1 + x, b);
            simd::store(p2 + x, c);
        });
    }
    // The 48 bytes as four runs of 12 (four one-byte or two two-byte
    // pixels), each grouped by channel into 32-bit lanes by one shuffle,
    // then a 4 x 4 transpose of those lanes: one shuffle mask instead of
    // nine, which keeps the loop in eight registers.
    const Bytes16 g = groupChannels3<sizeof(E)>();
    return eachBlock<16 / sizeof(E)>(n, [&](ptrdiff_t x) {
        using namespace simd;
        Bytes16 in[3];
        loadBlock(s + 3 * x, in);
        Words4 v0 = bitcast<uint32_t>(shuffleBytes(in[0], g));
        Words4 v1 = bitcast<uint32_t>(shuffleBytes(alignBytes<12>(in[1], in[0]), g));
        Words4 v2 = bitcast<uint32_t>(shuffleBytes(alignBytes<8>(in[2], in[1]), g));
        Words4 v3 = bitcast<uint32_t>(shuffleBytes(shiftBytesDown<4>(in[2]), g));
        transpose4(v0, v1, v2, v3);
        storeTo(p0 + x, v0);
        storeTo(p1 + x, v1);
        storeTo(p2 + x, v2);
    });
}

// Three planes into interleaved pixels: the first two planes are interleaved
// into pairs by unpacking (lo: the first half of the pixels, hi: the second,
// mid: the pairs from kMid on), so every output register is one shuffle of a
// pair register ORed with one shuffle of the third plane: nine shuffle-unit
// operations as with three shuffles per output, but half the ORs and fewer
// register copies.
template <int E>
struct MergeShuffles {
    static constexpr int kMid = E == 1 ? 5 : 3;  // first pixel with an element of plane 0 or 1 in output 1
    static constexpr int kFirst[3] = {0, kMid, 8 / E};  // first pair of lo, mid, hi
    alignas(16) uint8_t pairs[3][16];
    alignas(16) uint8_t third[3][16];
    constexpr MergeShuffles() : pairs{}, third{} {
        for (int o = 0; o < 3; ++o)
            for (int l = 0; l < 16; ++l) {
                const int elem = (o * 16 + l) / E, byte = l % E, pixel = elem / 3, k = elem % 3;
                pairs[o][l] = k < 2 ? static_cast<uint8_t>(((pixel - kFirst[o]) * 2 + k) * E + byte) : uint8_t(0x80);
                third[o][l] = k == 2 ? static_cast<uint8_t>(pixel * E + byte) : uint8_t(0x80);
            }
    }
};

template <class E>
ptrdiff_t merge3Simd(const E* const* planes, E* d, ptrdiff_t n) {
    using namespace simd;
    using V = Vec<E, 16>;
    constexpr int e = sizeof(E);
    alignas(16) static constexpr MergeShuffles<e> t{};
    const E* p0 = planes[0];
    const E* p1 = planes[1];
    const E* p2 = planes[2];
    if constexpr (kWideBytes<E>) {
        using W = Vec<uint8_t>;
        return eachBlock<W::kLanes>(n, [&](ptrdiff_t x) {
            storeInterleaved3(d + 3 * x, load<W>(p0 + x), load<W>(p1 + x), load<W>(p2 + x));
        });
    }
    return eachBlock<V::kLanes>(n, [&](ptrdiff_t x) {
        const V a = load<V>(p0 + x), b = load<V>(p1 + x);
        const Bytes16 c = loadFrom<Bytes16>(p2 + x);
        const Bytes16 lo = bitcast<uint8_t>(zipLo(a, b)), hi = bitcast<uint8_t>(zipHi(a, b));
        const Bytes16 mid = alignBytes<MergeShuffles<e>::kMid * 2 * e>(hi, lo);
        const Bytes16 pairs[3] = {lo, mid, hi};
        E* out = d + 3 * x;
        for (int o = 0; o < 3; ++o)
            storeTo(out + o * V::kLanes, shuffleBytes(pairs[o], loadAligned<Bytes16>(t.pairs[o])) |
                                             shuffleBytes(c, loadAligned<Bytes16>(t.third[o])));
    });
}

// Four channels <-> four planes, 64 bytes at a time: one shuffle per
// register groups each channel's elements into one 32-bit lane, then a 4 x 4
// transpose of those lanes across the registers (its own inverse).
// Lane k of the result holds channel k of the register's pixels.
template <int E>
inline Bytes16 groupChannels() {
    if constexpr (E == 1) return simd::fromLanes<Bytes16>({0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15});
    else return simd::fromLanes<Bytes16>({0, 1, 8, 9, 2, 3, 10, 11, 4, 5, 12, 13, 6, 7, 14, 15});
}
template <int E>
inline Bytes16 spreadChannels() {  // the inverse of groupChannels
    if constexpr (E == 1) return simd::fromLanes<Bytes16>({0, 4, 8, 12, 1, 5, 9, 13, 2, 6, 10, 14, 3, 7, 11, 15});
    else return simd::fromLanes<Bytes16>({0, 1, 4, 5, 8, 9, 12, 13, 2, 3, 6, 7, 10, 11, 14, 15});
}

template <class E>
ptrdiff_t split4Simd(const E* s, E* const* planes, ptrdiff_t n) {
    using namespace simd;
    constexpr ptrdiff_t per = 16 / sizeof(E);
    const Bytes16 g = groupChannels<sizeof(E)>();
    ptrdiff_t x = 0;
    for (; x + per <= n; x += per) {
        Words4 v[4];
        for (int k = 0; k < 4; ++k) v[k] = bitcast<uint32_t>(shuffleBytes(loadFrom<Bytes16>(s + 4 * x + k * per), g));
        transpose4(v[0], v[1], v[2], v[3]);
        for (int k = 0; k < 4; ++k) storeTo(planes[k] + x, v[k]);
    }
    return x;
}

template <class E>
ptrdiff_t merge4Simd(const E* const* planes, E* d, ptrdiff_t n) {
    using namespace simd;
    constexpr ptrdiff_t per = 16 / sizeof(E);
    const Bytes16 sp = spreadChannels<sizeof(E)>();
    ptrdiff_t x = 0;
    for (; x + per <= n; x += per) {
        Words4 v[4];
        for (int k = 0; k < 4; ++k) v[k] = loadFrom<Words4>(planes[k] + x);
        transpose4(v[0], v[1], v[2], v[3]);
        for (int k = 0; k < 4; ++k) storeTo(d + 4 * x + k * per, shuffleBytes(bitcast<uint8_t>(v[k]), sp));
    }
    return x;
}

// One element of every SC-element pixel (SC = 3 or 4) into a plain row.
// The loads never reach past the last chosen element: the pointer may
// address the pixel's last channel, with nothing of the row after it.
template <class E, int SC>
struct PickMap {
    static constexpr int src(int j) { return (j / static_cast<int>(sizeof(E))) * SC * sizeof(E) + j % sizeof(E); }
};
template <class E, int SC>
ptrdiff_t pickOneSimd(const E* s, E* d, ptrdiff_t n) {
    using namespace simd;
    constexpr ptrdiff_t per = 16 / sizeof(E);
    // masks for register r of the SC-register block: output lane j takes
    // byte src(j) - 16 r when it falls into register r
    alignas(16) static constexpr auto masks = [] {
        struct { uint8_t m[SC][16]; } t{};
        for (int r = 0; r < SC; ++r)
            for (int j = 0; j < 16; ++j) {
                const int b = PickMap<E, SC>::src(j);
                t.m[r][j] = b / 16 == r ? static_cast<uint8_t>(b % 16) : uint8_t(0x80);
            }
        return t;
    }();
    ptrdiff_t x = 0;
    // last chosen element at (n-1)*SC: the block [x*SC, x*SC + per*SC) must end by it
    for (; (x + per) * SC <= (n - 1) * SC + 1; x += per) {
        const uint8_t* b = reinterpret_cast<const uint8_t*>(s + x * SC);
        Bytes16 acc = shuffleBytes(load<Bytes16>(b), loadAligned<Bytes16>(masks.m[0]));
        for (int r = 1; r < SC; ++r) acc = acc | shuffleBytes(load<Bytes16>(b + 16 * r), loadAligned<Bytes16>(masks.m[r]));
        storeTo(d + x, acc);
    }
    return x;
}

// Four-element pixels with alpha <-> three-element pixels, 64 <-> 48 bytes:
// within a register the colour elements are packed into its first 12 bytes
// (or spread from them), and byte shifts move the 12-byte groups between
// registers.  E is the element size; the masks only differ by it.
template <int E>
inline Bytes16 packColour() {  // 16 bytes of 4-element pixels -> 12 bytes of colour, 4 zero
    if constexpr (E == 1) return simd::fromLanes<Bytes16>({0, 1, 2, 4, 5, 6, 8, 9, 10, 12, 13, 14, 255, 255, 255, 255});
    else return simd::fromLanes<Bytes16>({0, 1, 2, 3, 4, 5, 8, 9, 10, 11, 12, 13, 255, 255, 255, 255});
}
template <int E>
inline Bytes16 spreadColour() {  // 12 bytes of colour -> 16 bytes of pixels, alpha zero
    if constexpr (E == 1) return simd::fromLanes<Bytes16>({0, 1, 2, 255, 3, 4, 5, 255, 6, 7, 8, 255, 9, 10, 11, 255});
    else return simd::fromLanes<Bytes16>({0, 1, 2, 3, 4, 5, 255, 255, 6, 7, 8, 9, 10, 11, 255, 255});
}

template <class E>
ptrdiff_t dropAlphaSimd(const E* s, E* d, ptrdiff_t n) {
    using namespace simd;
    constexpr ptrdiff_t per = 16 / sizeof(E);  // pixels per 64 source bytes
    const Bytes16 m = packColour<sizeof(E)>();
    const uint8_t* sb = reinterpret_cast<const uint8_t*>(s);
    uint8_t* db = reinterpret_cast<uint8_t*>(d);
    ptrdiff_t x = 0;
    for (; x + per <= n; x += per, sb += 64, db += 48) {
        const auto colour = [&](int k) { return shuffleBytes(load<Bytes16>(sb + 16 * k), m); };
        const Bytes16 a = colour(0), b = colour(1), c = colour(2), e = colour(3);
        store(db, a | shiftBytesUp<12>(b));
        store(db + 16, shiftBytesDown<4>(b) | shiftBytesUp<8>(c));
        store(db + 32, shiftBytesDown<8>(c) | shiftBytesUp<4>(e));
    }
    return x;
}

template <class E>
ptrdiff_t keepAlphaSimd(const E* s, E* d, ptrdiff_t n) {
    using namespace simd;
    constexpr ptrdiff_t per = 16 / sizeof(E);
    const Bytes16 m = spreadColour<sizeof(E)>(), alpha = alphaBytes<sizeof(E), 16>();
    const uint8_t* sb = reinterpret_cast<const uint8_t*>(s);
    uint8_t* db = reinterpret_cast<uint8_t*>(d);
    ptrdiff_t x = 0;
    for (; x + per <= n; x += per, sb += 48, db += 64) {
        Bytes16 i[3];
        loadBlock(sb, i);
        const Bytes16 g[4] = {i[0], alignBytes<12>(i[1], i[0]), alignBytes<8>(i[2], i[1]), shiftBytesDown<4>(i[2])};
        for (int k = 0; k < 4; ++k)  // the destination's alpha is carried over as it is
            store(db + 16 * k, select(alpha, load<Bytes16>(db + 16 * k), shuffleBytes(g[k], m)));
    }
    return x;
}

struct DupMap {  // one plane into all three channels
    static constexpr int src(int j) { return j / 3; }
};

// Sixteen three-channel 8-bit pixels under a mask: where the mask byte is
// non-zero the pixel takes `fresh`, elsewhere it keeps what it holds.
inline void maskedStore48(uint8_t* d, const uint8_t* m, const Bytes16 (&fresh)[3]) {
    using namespace simd;
    const Bytes16 stays = eq(load<Bytes16>(m), zero<Bytes16>());
    const Bytes16 in[3] = {stays, stays, stays};
    Bytes16 keep[3];
    Shuffle48<DupMap>::apply(in, keep);
    for (int k = 0; k < 3; ++k) store(d + 16 * k, select(keep[k], load<Bytes16>(d + 16 * k), fresh[k]));
}

// Channel order applied to 48-byte blocks of three-element pixels: output
// register k draws on input registers k-1..k+1 only (a pixel never moves
// further than its own bytes).  Registers wider than 16 bytes hold one
// 48-byte block per 16-byte lane block (loadBlocks at a stride of 48), so
// the same per-block shuffles serve every width.
using SwapBytes = simd::Vec<uint8_t>;
struct SwapShuffle {
    SwapBytes m[3][3];
    SwapShuffle(const int (&o)[3], int elemBytes) {
        alignas(16) uint8_t t[3][3][16];
        for (int j = 0; j < 48; ++j) {
            const int elem = j / elemBytes, byte = j % elemBytes;
            const int s = ((elem / 3) * 3 + o[elem % 3]) * elemBytes + byte;
            for (int r = 0; r < 3; ++r)
                t[j / 16][r][j % 16] = s / 16 == r ? static_cast<uint8_t>(s % 16) : uint8_t(0x80);
        }
        for (int a = 0; a < 3; ++a)
            for (int r = 0; r < 3; ++r) m[a][r] = simd::loadBlocks<SwapBytes>(t[a][r], 0);
    }
    void apply(const SwapBytes (&in)[3], SwapBytes (&out)[3]) const {
        using simd::shuffleBytes;
        out[0] = shuffleBytes(in[0], m[0][0]) | shuffleBytes(in[1], m[0][1]);
        out[1] = (shuffleBytes(in[0], m[1][0]) | shuffleBytes(in[1], m[1][1])) | shuffleBytes(in[2], m[1][2]);
        out[2] = shuffleBytes(in[1], m[2][1]) | shuffleBytes(in[2], m[2][2]);
    }
};

// Returns the bytes done (whole groups of 48-byte blocks).  A group is read
// whole before it is written: the in-place form relies on it.
ptrdiff_t swap3Simd(const uint8_t* s, uint8_t* d, ptrdiff_t bytes, const SwapShuffle& sh) {
    using namespace simd;
    constexpr ptrdiff_t kGroup = 3 * SwapBytes::kBytes;
    return eachBlock<kGroup>(bytes, [&](ptrdiff_t i) {
        SwapBytes in[3], out[3];
        for (int r = 0; r < 3; ++r) in[r] = loadBlocks<SwapBytes>(s + i + 16 * r, 48);
        sh.apply(in, out);
        for (int r = 0; r < 3; ++r) storeBlocks(d + i + 16 * r, 48, out[r]);
    });
}

// Four-element pixels: the order picks colour elements inside 16 bytes; the
// destination's alpha is carried over unchanged.
struct SwapShuffle4 {
    SwapBytes m, alpha;
    SwapShuffle4(const int (&o)[3], int elemBytes) {
        alignas(16) uint8_t t[16], a[16];
        for (int j = 0; j < 16; ++j) {
            const int elem = j / elemBytes, byte = j % elemBytes, pixel = elem / 4, k = elem % 4;
            t[j] = k == 3 ? uint8_t(0x80) : static_cast<uint8_t>((pixel * 4 + o[k]) * elemBytes + byte);
            a[j] = k == 3 ? 0xFF : 0;
        }
        m = simd::loadBlocks<SwapBytes>(t, 0);
        alpha = simd::loadBlocks<SwapBytes>(a, 0);
    }
};

ptrdiff_t swap4Simd(const uint8_t* s, uint8_t* d, ptrdiff_t bytes, const SwapShuffle4& sh) {
    using namespace simd;
    ptrdiff_t i = 0;
    for (; i + SwapBytes::kBytes <= bytes; i += SwapBytes::kBytes)
        store(d + i, select(sh.alpha, load<SwapBytes>(d + i), shuffleBytes(load<SwapBytes>(s + i), sh.m)));
    return i;
}
#endif

}  // namespace
}}  // namespace zor::ZOR_NS
