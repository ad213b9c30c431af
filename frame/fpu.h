// Making x87 arithmetic round like IEEE double.
//
// The generic and SSE variants of the 32-bit build do their floating-point
// work on the x87 unit, whose registers carry 64-bit mantissas by default.
// Where a result is defined as "computed in double and rounded once", those
// variants set the x87 precision control to 53 bits for the duration of the
// loop (DoublePrecisionScope), and round to float through a store
// (toFloat), so every variant gives the same bits.  Everywhere else (x86-64,
// and the 32-bit SSE2+ variants, which use SSE arithmetic) both are no-ops.
#pragma once

#include "frame/abi.h"

#include <cstdint>

namespace zor { inline namespace ZOR_INLINE_NS {

#if defined(__i386__) && !defined(__SSE2_MATH__)
#  define ZOR_X87_MATH 1
#else
#  define ZOR_X87_MATH 0
#endif

class DoublePrecisionScope {
public:
#if ZOR_X87_MATH
    DoublePrecisionScope() {
        __asm__ volatile("fnstcw %0" : "=m"(saved_));
        const uint16_t cw = static_cast<uint16_t>((saved_ & ~0x0300u) | 0x0200u);  // PC = 53 bits
        __asm__ volatile("fldcw %0" : : "m"(cw));
    }
    ~DoublePrecisionScope() { __asm__ volatile("fldcw %0" : : "m"(saved_)); }

private:
    uint16_t saved_;
#else
    DoublePrecisionScope() {}
#endif
    DoublePrecisionScope(const DoublePrecisionScope&) = delete;
    DoublePrecisionScope& operator=(const DoublePrecisionScope&) = delete;
};

// Rounds a double to float exactly once, even where the compiler would keep
// the value in an x87 register.
inline float toFloat(double x) {
#if ZOR_X87_MATH
    volatile float f = static_cast<float>(x);
    return f;
#else
    return static_cast<float>(x);
#endif
}

// Forces a double result out of an x87 register (rounding it to double).
inline double toDouble(double x) {
#if ZOR_X87_MATH
    volatile double d = x;
    return d;
#else
    return x;
#endif
}

}}  // namespace zor::ZOR_INLINE_NS
