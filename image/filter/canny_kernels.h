// The Canny detectors (image/filter/canny.cpp): the scalar one (32-bit
// magnitudes, byte candidate map) for every variant, and the vector one
// (16-bit coded magnitudes, suppression 8 pixels at a time, candidate
// bitmap, growth every 16 rows) from SSE2.  Both write their state into the
// caller's buffer.  Included by canny.cpp only, after frame/variant.h.
#pragma once

#include "frame/row_address.h"
#include "frame/simd.h"

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace zor { namespace ZOR_NS {
namespace {

inline uint8_t* alignUp(uint8_t* p, size_t a) {
    return reinterpret_cast<uint8_t*>((reinterpret_cast<uintptr_t>(p) + a - 1) & ~(uintptr_t(a) - 1));
}

// Magnitudes of one ROI row into m[0 .. w-1] (the frame elements stay 0).
void magnitudeRow(const int16_t* dx, const int16_t* dy, int32_t* m, int w, int low) {
    int x = 0;
#if ZOR_SIMD >= 2
    // 8 pixels per 16-byte register of derivatives, their sums in two
    using namespace simd;
    using V = Vec<int16_t, 16>;
    using W = Vec<int32_t, 16>;
    const W lowV = set1<W>(low);
    for (; x + 8 <= w; x += 8) {
        // |v| fits 16 unsigned bits (|-32768| = 0x8000): zero-extend it
        const auto a = bitcast<uint16_t>(abs(load<V>(dx + x))), b = bitcast<uint16_t>(abs(load<V>(dy + x)));
        W lo = bitcast<int32_t>(widenLo(a) + widenLo(b));
        W hi = bitcast<int32_t>(widenHi(a) + widenHi(b));
        lo = lo & gt(lo, lowV);
        hi = hi & gt(hi, lowV);
        store(m + x, lo);
        store(m + x + 4, hi);
    }
#endif
    for (; x < w; ++x) {
        const int32_t v = (dx[x] < 0 ? -int32_t(dx[x]) : dx[x]) + (dy[x] < 0 ? -int32_t(dy[x]) : dy[x]);
        m[x] = v > low ? v : 0;
    }
}

template <class Coord>
class EdgeStack {
public:
    explicit EdgeStack(uint8_t* base) : base_(reinterpret_cast<Coord*>(base)), top_(base_) {}
    void push(ptrdiff_t row, ptrdiff_t col) {
        top_[0] = static_cast<Coord>(row);
        top_[1] = static_cast<Coord>(col);
        top_ += 2;
    }
    bool pop(ptrdiff_t& row, ptrdiff_t& col) {
        if (top_ == base_) return false;
        top_ -= 2;
        row = top_[0];
        col = top_[1];
        return true;
    }

private:
    Coord* base_;
    Coord* top_;
};

// Grows the edges: pops the stack (last in, first out) and visits the
// neighbours in the order upper left, up, upper right, left, right, lower
// left, down, lower right, those of rows up to lastRow only (the rows whose
// candidates are settled).  The map's frame is 0, so no bounds checks.  The
// grown set does not depend on the order of the visits: it is every
// candidate connected to a strong pixel.
template <class Coord>
void grow(EdgeStack<Coord>& stack, const uint8_t* map, size_t pw, uint8_t* dst, int dstStep,
          ptrdiff_t lastRow) {
    static const int kDy[8] = {-1, -1, -1, 0, 0, 1, 1, 1};
    static const int kDx[8] = {-1, 0, 1, -1, 1, -1, 0, 1};
    ptrdiff_t r, c;
    while (stack.pop(r, c)) {
        const int visits = r < lastRow ? 8 : 5;
        for (int k = 0; k < visits; ++k) {
            const ptrdiff_t nr = r + kDy[k], nc = c + kDx[k];
            if (map[size_t(nr + 1) * pw + size_t(nc + 1)] < 128) continue;
            uint8_t* d = rowAt(dst, dstStep, nr) + nc;
            if (*d != 0) continue;
            *d = 255;
            stack.push(nr, nc);
        }
    }
}

constexpr double kTan22 = 0.41421356237309503;  // tan 22.5 degrees
constexpr double kTan67 = 2.414213562373095;    // tan 67.5 degrees

template <class Coord>
void detect(const int16_t* dx, int dxStep, const int16_t* dy, int dyStep, uint8_t* dst, int dstStep,
            ImageSize roi, int low, float high, uint8_t* buffer) {
    const int w = roi.width, h = roi.height;
    const size_t pw = size_t(w) + 2;  // padded width
    // buffer: three magnitude rows, the candidate map, the stack
    int32_t* ringBase = reinterpret_cast<int32_t*>(alignUp(buffer, 16));
    int32_t* mag[3] = {ringBase, ringBase + pw, ringBase + 2 * pw};
    uint8_t* map = reinterpret_cast<uint8_t*>(ringBase + 3 * pw);
    const size_t mapBytes = pw * (size_t(h) + 2);
    EdgeStack<Coord> stack(alignUp(map + mapBytes, sizeof(Coord) * 2));

    std::memset(map, 0, mapBytes);
    std::memset(mag[0], 0, 3 * pw * sizeof(int32_t));

    // Magnitude row r of the ROI lives in mag[(r + 1) % 3] + 1 once computed;
    // row -1 (all 0) starts in mag[0].
    auto magRow = [&](ptrdiff_t r) { return mag[(r + 1) % 3] + 1; };
    magnitudeRow(dx, dy, magRow(0), w, low);
    for (ptrdiff_t r = 0; r < h; ++r) {
        int32_t* below = magRow(r + 1);
        if (r + 1 < h)
            magnitudeRow(rowAt(dx, dxStep, r + 1), rowAt(dy, dyStep, r + 1), below, w, low);
        else
            std::memset(below - 1, 0, pw * sizeof(int32_t));
        const int32_t* above = magRow(r - 1);
        const int32_t* cur = magRow(r);
        const int16_t* dxr = rowAt(dx, dxStep, r);
        const int16_t* dyr = rowAt(dy, dyStep, r);
        uint8_t* mapRow = map + size_t(r + 1) * pw + 1;
        uint8_t* dstRow = rowAt(dst, dstStep, r);
        for (int x = 0; x < w; ++x) {
#if ZOR_SIMD >= 2
            // most magnitudes are cleared by the low threshold: skip 16 zeros at once
            if ((x & 15) == 0 && x + 16 <= w) {
                using namespace simd;
                using W = Vec<int32_t, 16>;
                const W any = (load<W>(cur + x) | load<W>(cur + x + 4)) | (load<W>(cur + x + 8) | load<W>(cur + x + 12));
                if (allTrue(eq(any, zero<W>()))) {
                    x += 15;
                    continue;
                }
            }
#endif
            const int32_t m = cur[x];
            if (m <= 0) continue;
            const int32_t gx = dxr[x], gy = dyr[x];
            const int32_t ax = gx < 0 ? -gx : gx, ay = gy < 0 ? -gy : gy;
            bool keep;
            if (static_cast<double>(ay) < kTan22 * static_cast<double>(ax)) {
                keep = m > cur[x - 1] && m >= cur[x + 1];                  // left, right
            } else if (static_cast<double>(ay) <= kTan67 * static_cast<double>(ax)) {
                if ((gx ^ gy) < 0)
                    keep = m > above[x + 1] && m > below[x - 1];           // upper right, lower left
                else
                    keep = m > above[x - 1] && m > below[x + 1];           // upper left, lower right
            } else {
                keep = m > above[x] && m >= below[x];                      // up, down
            }
            if (!keep) continue;
            mapRow[x] = 128;
            if (static_cast<float>(m) > high) {
                dstRow[x] = 255;
                stack.push(r, x);
            }
        }
    }

    grow(stack, map, pw, dst, dstStep, h - 1);
}

#if ZOR_SIMD >= 2
// The vector detector.  Magnitudes are kept in 16 bits as E = M - L for
// M > L and 0 otherwise: one to one and in order for every M up to 65535.
// The one larger magnitude, 65536 (both derivatives -32768), is detected
// and handed to the scalar detector.  Stored with the sign bit flipped
// (E ^ 0x8000), they compare with the signed 16-bit instructions.
// Non-maximum suppression then runs on 8 pixels at a time, the direction
// classes formed by the same double products as the scalar test.

// Blocks of 8 pixels: one 16-byte register of 16-bit lanes, one byte of the
// candidate bitmap.
using S8 = simd::Vec<int16_t, 16>;
using U8 = simd::Vec<uint16_t, 16>;

// |v| as an unsigned 16-bit value (|-32768| = 0x8000).
inline U8 abs16(S8 v) { return simd::bitcast<uint16_t>(simd::abs(v)); }

constexpr int16_t kBias = -32768;  // the stored form of a cleared magnitude

// Stored magnitudes of 8 pixels into e[0 .. 7]; returns the cleared lanes.
// A magnitude of 65536 saturates to 65535 here: the suppression, which
// visits every block that keeps a magnitude, looks for it (with low below
// 65535 such a block always keeps one).
inline S8 codedBlock(const int16_t* dx, const int16_t* dy, int16_t* e, U8 lowV) {
    using namespace simd;
    const U8 a = abs16(load<S8>(dx)), b = abs16(load<S8>(dy));
    const U8 m = subSat(addSat(a, b), lowV);  // M - L above L, else 0
    store(e, bitcast<int16_t>(m ^ set1<U8>(0x8000)));
    return bitcast<int16_t>(eq(m, zero<U8>()));
}

// Stored magnitudes of one ROI row into e[0 .. w-1], and the list of the
// blocks of 8 that keep a magnitude (their first columns; a last partial
// block is always listed, it overlaps the one before).  Returns the count,
// or -1 when the scalar tail holds a magnitude of 65536.
int codedRow(const int16_t* dx, const int16_t* dy, int16_t* e, int w, int low, int32_t* blocks) {
    using namespace simd;
    const U8 lowV = set1<U8>(static_cast<uint16_t>(low));
    int x = 0, count = 0;
    // The kept blocks are few and scattered: they are listed without a
    // branch, two at a time from one mask of 16 cleared flags.
    for (; x + 16 <= w; x += 16) {
        const S8 c0 = codedBlock(dx + x, dy + x, e + x, lowV);
        const S8 c1 = codedBlock(dx + x + 8, dy + x + 8, e + x + 8, lowV);
        const unsigned cleared = static_cast<unsigned>(laneMask(narrowSat<int8_t>(c0, c1)));
        blocks[count] = x;
        count += (cleared & 0xFFu) != 0xFFu;
        blocks[count] = x + 8;
        count += cleared < 0xFF00u;
    }
    if (x + 8 <= w) {
        const S8 c0 = codedBlock(dx + x, dy + x, e + x, lowV);
        blocks[count] = x;
        count += !allTrue(c0);
        x += 8;
    }
    if (x < w) blocks[count++] = x;
    for (; x < w; ++x) {
        const int32_t m = (dx[x] < 0 ? -int32_t(dx[x]) : dx[x]) + (dy[x] < 0 ? -int32_t(dy[x]) : dy[x]);
        if (m > 65535) return -1;
        e[x] = static_cast<int16_t>((m > low ? m - low : 0) ^ 0x8000);
    }
    return count;
}

// Direction classes of 8 pixels from |dx| and |dy| (unsigned 16-bit): the
// scalar test's double comparisons in exact integer form.  For ax > 0 the
// product t * ax (t = tan 22.5 or tan 67.5, the double constants) is never
// within 2^-15 of an integer, so ay < t * ax holds exactly when
// ay <= floor(t * ax), and ay > t * ax when ay > floor(t * ax).  Both floors
// come from F = floor(ax * 0x6A09E667 / 2^32), which equals floor(ax * tan
// 22.5) and floor(ax * (tan 67.5 - 2)) for every ax up to 32768.  (ax = 0
// differs only for dx = dy = 0, a magnitude that is always cleared.)
// c1: the lanes of class 1 (ay < tan 22.5 * ax); notC3: the lanes outside
// class 3 (ay <= tan 67.5 * ax).
inline void directionClasses(U8 ax, U8 ay, S8& c1, S8& notC3) {
    using namespace simd;
    const U8 z = zero<U8>();
    const U8 kHi = set1<U8>(0x6A09), kLo = set1<U8>(0xE667);
    // ax * 0x6A09E667 / 2^32 = (ax * 0x6A09 + ax * 0xE667 / 2^16) / 2^16
    const U8 hi = mulHi(ax, kHi), lo = ax * kHi;
    const U8 part = mulHi(ax, kLo);
    const U8 noCarry = eq(lo + part, addSat(lo, part));
    const U8 f = (hi - set1<U8>(0xFFFF)) + noCarry;  // hi + carry
    c1 = bitcast<int16_t>(eq(subSat(ay, f), z));
    // 2 ax + F saturates at 65535 from ax = 16384 on, where ay cannot exceed it anyway
    notC3 = bitcast<int16_t>(eq(subSat(ay, addSat(addSat(ax, ax), f)), z));
}

// The vector detector keeps its candidates in a bitmap: bit c + 8 of row
// r + 1 is pixel (r, c), so that a frame of one row and eight columns
// surrounds the ROI and a block of 8 pixels starting at a multiple of 8 is
// one byte.  A bit is set for a candidate that is not (yet) an edge; it is
// cleared when the pixel becomes one.  Some 300 KB for 1920 x 1080: it stays
// in the cache.
struct Waiting {
    uint8_t* bits;
    size_t stride;  // bytes per row

    static size_t strideFor(int w) { return (size_t(w) + 9 + 63) / 64 * 8; }

    // Bit k of the result, for k in 0-2, 4-6 and 8-10: pixel
    // (r + k / 4 - 1, c + k % 4 - 1) is waiting.  The row below only when
    // withBelow.  Reads whole 32-bit words: at most three bytes beyond a
    // row, still inside the buffer.
    unsigned around(ptrdiff_t r, ptrdiff_t c, bool withBelow) const {
        const size_t first = size_t(c) + 7;  // pixel c - 1
        const uint8_t* p = bits + size_t(r) * stride + (first >> 3);  // row r - 1
        const unsigned shift = unsigned(first & 7);
        uint32_t a, b, d = 0;
        std::memcpy(&a, p, 4);
        std::memcpy(&b, p + stride, 4);
        if (withBelow) std::memcpy(&d, p + 2 * stride, 4);
        return ((a >> shift) & 7u) | (((b >> shift) & 7u) << 4) | (((d >> shift) & 7u) << 8);
    }
    void clear(ptrdiff_t r, ptrdiff_t c) {
        bits[size_t(r + 1) * stride + (size_t(c + 8) >> 3)] &= static_cast<uint8_t>(~(1u << ((c + 8) & 7)));
    }
    // Pixels (r, c .. c + 7) from the low 8 bits of v; c is a multiple of 8
    // or the row's last block, which overlaps the one before (ORed in).
    void set8(ptrdiff_t r, ptrdiff_t c, unsigned v) {
        uint8_t* p = bits + size_t(r + 1) * stride + (size_t(c + 8) >> 3);
        if ((c & 7) == 0) {
            *p = static_cast<uint8_t>(v);
            return;
        }
        uint16_t t;
        std::memcpy(&t, p, 2);
        t = static_cast<uint16_t>(t | (v << (c & 7)));
        std::memcpy(p, &t, 2);
    }
};

// Pixels become edges: bit cleared, dst 255, pushed.  Bit k of bits is the
// neighbour (k / 4 - 1, k % 4 - 1) of (r, c), taken in ascending order.
template <class Coord>
inline void takeAround(EdgeStack<Coord>& stack, unsigned bits, Waiting& map, uint8_t* dst, int dstStep,
                       ptrdiff_t r, ptrdiff_t c) {
    while (bits) {
        const int k = __builtin_ctz(bits);
        bits &= bits - 1;
        const ptrdiff_t nr = r + (k >> 2) - 1, nc = c + (k & 3) - 1;
        map.clear(nr, nc);
        rowAt(dst, dstStep, nr)[nc] = 255;
        stack.push(nr, nc);
    }
}

// Grows the edges through the candidates of the settled rows (up to
// lastRow).  The grown set does not depend on the order of the visits: it is
// every candidate connected to a strong pixel.  Edges of lastRow itself
// cannot look below yet: their columns are kept in waiting.
template <class Coord>
void growSettled(EdgeStack<Coord>& stack, Waiting& map, uint8_t* dst, int dstStep, ptrdiff_t lastRow,
                 Coord* waiting, size_t& waitingCount) {
    ptrdiff_t r, c;
    while (stack.pop(r, c)) {
        const bool below = r < lastRow;
        if (!below) waiting[waitingCount++] = static_cast<Coord>(c);
        takeAround(stack, map.around(r, c, below), map, dst, dstStep, r, c);
    }
}

// low in 0..65534, width >= 8.  strongFrom: the smallest E that is above
// the high threshold, or -1 when none is.  Each dst row is cleared up to the
// step as its turn comes: the growth only writes rows already visited.
// Returns false, having written dst in part, when it meets a magnitude of
// 65536.
template <class Coord>
bool detectCoded(const int16_t* dx, int dxStep, const int16_t* dy, int dyStep, uint8_t* dst, int dstStep,
                 ImageSize roi, int low, int strongFrom, uint8_t* buffer) {
    const int w = roi.width, h = roi.height;
    const size_t pw = size_t(w) + 2;
    // buffer: three magnitude rows, the block list, the waiting columns, the
    // map, the stack
    int16_t* ringBase = reinterpret_cast<int16_t*>(alignUp(buffer, 16));
    int16_t* mag[3] = {ringBase, ringBase + pw, ringBase + 2 * pw};
    // block lists of two rows (w / 8 + 1 entries each)
    int32_t* lists = reinterpret_cast<int32_t*>(alignUp(reinterpret_cast<uint8_t*>(ringBase + 3 * pw), 4));
    int32_t* blockList[2] = {lists, lists + (w / 8 + 1)};
    int blockCount[2] = {0, 0};
    Coord* waiting = reinterpret_cast<Coord*>(lists + 2 * (w / 8 + 1));
    Waiting map{reinterpret_cast<uint8_t*>(waiting + w), Waiting::strideFor(w)};
    const size_t mapBytes = map.stride * (size_t(h) + 2);
    EdgeStack<Coord> stack(alignUp(map.bits + mapBytes, sizeof(Coord) * 2));
    // the map's frame rows here, each ROI row (with its frame columns) below
    std::memset(map.bits, 0, map.stride);
    std::memset(map.bits + mapBytes - map.stride, 0, map.stride);
    for (size_t i = 0; i < 3 * pw; ++i) ringBase[i] = kBias;
    size_t waitingCount = 0;

    using namespace simd;
    const S8 bias = set1<S8>(kBias), ones = set1<S8>(-1);
    const S8 strongV = set1<S8>(static_cast<int16_t>((strongFrom < 0 ? 0 : strongFrom) ^ 0x8000));
    const S8 canBeStrong = strongFrom < 0 ? zero<S8>() : ones;
    auto magRow = [&](ptrdiff_t r) { return mag[(r + 1) % 3] + 1; };
    blockCount[0] = codedRow(dx, dy, magRow(0), w, low, blockList[0]);
    if (blockCount[0] < 0) return false;
    ptrdiff_t settled = -1;  // the rows up to here are grown
    for (ptrdiff_t r = 0; r < h; ++r) {
        int16_t* below = magRow(r + 1);
        if (r + 1 < h)
        {
            blockCount[(r + 1) & 1] =
                codedRow(rowAt(dx, dxStep, r + 1), rowAt(dy, dyStep, r + 1), below, w, low, blockList[(r + 1) & 1]);
            if (blockCount[(r + 1) & 1] < 0) return false;
        }
        else
            for (size_t i = 0; i < pw; ++i) below[ptrdiff_t(i) - 1] = kBias;
        const int16_t* above = magRow(r - 1);
        const int16_t* cur = magRow(r);
        const int16_t* dxr = rowAt(dx, dxStep, r);
        const int16_t* dyr = rowAt(dy, dyStep, r);
        uint8_t* dstRow = rowAt(dst, dstStep, r);
        std::memset(dstRow, 0, size_t(dstStep));
        std::memset(map.bits + size_t(r + 1) * map.stride, 0, map.stride);

        const int32_t* blocks = blockList[r & 1];
        const int count = blockCount[r & 1];
        for (int b = 0; b < count; ++b) {
            const int x0 = blocks[b];
            const int x = x0 + 8 <= w ? x0 : w - 8;
            const S8 m = load<S8>(cur + x);
            const S8 cleared = eq(m, bias);
            const S8 gx = load<S8>(dxr + x), gy = load<S8>(dyr + x);
            const U8 ax = abs16(gx), ay = abs16(gy);
            if (laneMask(bitcast<int16_t>(ax & ay))) return false;  // a magnitude of 65536
            S8 c1, notC3;
            directionClasses(ax, ay, c1, notC3);
            // a > b and a >= b (= not b > a) on the stored form
            const S8 k1 = andNot(gt(load<S8>(cur + x + 1), m), gt(m, load<S8>(cur + x - 1)));
            const S8 k3 = andNot(gt(load<S8>(below + x), m), gt(m, load<S8>(above + x)));
            const S8 k2 = gt(m, max(load<S8>(above + x + 1), load<S8>(below + x - 1)));
            const S8 k4 = gt(m, max(load<S8>(above + x - 1), load<S8>(below + x + 1)));
            const S8 differ = shr<15>(gx ^ gy);  // signs of dx and dy differ
            const S8 keep = andNot(cleared, select(c1, k1, select(notC3, select(differ, k2, k4), k3)));
            const S8 strong = (keep & canBeStrong) & (gt(strongV, m) ^ ones);
            const auto strongBytes = bitcast<uint8_t>(narrowSat<int8_t>(strong, strong));
            const auto weakBytes = narrowSat<int8_t>(andNot(strong, keep), zero<S8>());
            map.set8(r, x, static_cast<unsigned>(laneMask(weakBytes)));
            unsigned push = static_cast<unsigned>(laneMask(strongBytes)) & 0xFFu;
            if (!push) continue;
            storeHalf(dstRow + x, strongBytes);
            push &= 0xFFu << (x0 - x);  // pixels of an overlapping block are pushed once
            while (push) {
                const int i = __builtin_ctz(push);
                push &= push - 1;
                stack.push(r, x + i);
            }
        }
        // Grow the edges every few rows, while their rows are still in the
        // cache.  The edges of the row settled last time look below first.
        if ((r & 15) != 15 && r != h - 1) continue;
        for (size_t i = 0; i < waitingCount; ++i) {
            const ptrdiff_t c = waiting[i];
            takeAround(stack, map.around(settled + 2, c, false) & 0x7u, map, dst, dstStep, settled + 2, c);
        }
        waitingCount = 0;
        growSettled(stack, map, dst, dstStep, r, waiting, waitingCount);
        settled = r;
    }
    return true;
}
#endif

}  // namespace
}}  // namespace zor::ZOR_NS
