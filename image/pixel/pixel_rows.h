// Rows and blocks of the pixel movers (image/pixel/copy, image/pixel/convert,
// image/geometry/mirror): a region walked as one long row where it can be,
// and the loop over whole blocks of a row.
#pragma once

#include <cstddef>
#include <cstdint>

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

// Outputs of more bytes than this are written with non-temporal stores by
// the movers that have them (the fill of three-element pixels, bytes to
// floats): an output that large would mostly push other data out of the
// last-level cache, and plain stores would read every line from memory
// before writing it.  Outputs that fit in the cache stay there (plain
// stores into a 32 MiB last-level cache ran twice as fast as streaming
// 6-8 MiB images to memory); 16 MiB is half of such a cache.
constexpr int64_t kStreamBytes = int64_t(16) << 20;

inline bool streamsOutput(ImageSize roi, int bytesPerPixel) {
    return roi.width > 0 && roi.height > 0 &&
           int64_t(roi.width) * roi.height * bytesPerPixel > kStreamBytes;
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

}}  // namespace zor::ZOR_INLINE_NS
