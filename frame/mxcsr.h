// The SSE control and status register around float-to-integer conversions.
//
// cvtps2dq rounds by the mode that MXCSR holds.  While a ConversionScope
// lives, conversions round to nearest with ties to even, whatever mode the
// caller left; on exit the caller's mode is back.  The status flags are left
// as the conversions raised them: no result depends on them (tools such as
// valgrind do not model them).  With the invalid exception unmasked a SIMD
// conversion of a NaN could trap, so then armed() is false and the caller
// takes its element-by-element path.
#pragma once

#include "frame/abi.h"

#include <cstdint>

#if ZOR_SIMD >= 2
#  include <emmintrin.h>

namespace zor { inline namespace ZOR_INLINE_NS {

class ConversionScope {
public:
    ConversionScope() : entry_(_mm_getcsr()) {
        if (entry_ & kRounding) _mm_setcsr(entry_ & ~kRounding);
    }
    ~ConversionScope() {
        const unsigned now = _mm_getcsr();
        const unsigned back = (now & ~kRounding) | (entry_ & kRounding);
        if (back != now) _mm_setcsr(back);
    }
    ConversionScope(const ConversionScope&) = delete;
    ConversionScope& operator=(const ConversionScope&) = delete;

    bool armed() const { return (entry_ & kInvalidMask) != 0; }

private:
    static constexpr unsigned kInvalidMask = 0x0080, kRounding = 0x6000;
    const unsigned entry_;
};

// Everything the roundings of float and double arithmetic depend on: the
// SSE control bits (rounding, flush-to-zero, denormals-are-zero; not the
// sticky flags) and the x87 control word, which library functions may use.
// Equal states round every operation alike.
inline uint32_t arithmeticState() {
    uint16_t cw;
    __asm__ volatile("fnstcw %0" : "=m"(cw));
    return (_mm_getcsr() & 0xFFC0u) | (uint32_t(cw) << 16);
}

}}  // namespace zor::ZOR_INLINE_NS
#endif
