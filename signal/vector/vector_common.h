// Inline helpers shared by the signal vector families.
#pragma once

#include "frame/abi.h"

#include <cstdint>
#include <cstring>

namespace zor { inline namespace ZOR_INLINE_NS {

// 2^-scaleFactor, as halving 1.0 scaleFactor times (or doubling it
// -scaleFactor times) gives it: exact, subnormal down to 2^-1074, 0 beyond
// that (the last halving is a tie that rounds to even), infinite beyond
// 2^1023.  Built from the bits, so a huge factor costs no loop and no x87
// register can keep an exponent that a double cannot hold.
inline double scaleMultiplier(int scaleFactor) {
    const int64_t e = -static_cast<int64_t>(scaleFactor);
    uint64_t bits;
    if (e > 1023) bits = uint64_t(0x7ff) << 52;                      // +infinity
    else if (e >= -1022) bits = uint64_t(e + 1023) << 52;            // normal
    else if (e >= -1074) bits = uint64_t(1) << (e + 1074);           // subnormal
    else bits = 0;
    double d;
    std::memcpy(&d, &bits, sizeof d);
    return d;
}

}}  // namespace zor::ZOR_INLINE_NS
