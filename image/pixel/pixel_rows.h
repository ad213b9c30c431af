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
