// Making x87 arithmetic round like IEEE double.
//
// The generic and SSE variants of the 32-bit build do their floating-point
// work on the x87 unit, whose registers carry 64-bit mantissas by default.
// Where a result is defined as "computed in double and rounded once", those
// variants set the x87 precision control to 53 bits for the duration of the
// loop (DoublePrecisionScope), and round to float through a store
// (toFloat), so every variant gives the same bits; float kernels hold a
// SinglePrecisionScope instead.  Everywhere else (x86-64,
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

// Sets the x87 precision control (PcBits: 0x0200 for 53 bits, 0 for 24
// bits) for the lifetime of the scope and restores the caller's afterwards.
template <unsigned PcBits>
class PrecisionControlScope {
public:
#if ZOR_X87_MATH
    PrecisionControlScope() {
        __asm__ volatile("fnstcw %0" : "=m"(saved_));
        const uint16_t cw = static_cast<uint16_t>((saved_ & ~0x0300u) | PcBits);
        __asm__ volatile("fldcw %0" : : "m"(cw));
    }
    ~PrecisionControlScope() { __asm__ volatile("fldcw %0" : : "m"(saved_)); }

private:
    uint16_t saved_;
#else
    PrecisionControlScope() {}
#endif
    PrecisionControlScope(const PrecisionControlScope&) = delete;
    PrecisionControlScope& operator=(const PrecisionControlScope&) = delete;
};

// Results defined as double arithmetic rounded once.
using DoublePrecisionScope = PrecisionControlScope<0x0200u>;

// Results defined as a sequence of float operations (the float kernels
// that SSE runs lane by lane): every x87 operation then rounds its
// significand to 24 bits as SSE does, also where the compiler keeps the
// value in a register.  Equal to SSE for results in float's normal range
// (x87 registers keep their wider exponent, so overflow and denormal
// results may differ).
using SinglePrecisionScope = PrecisionControlScope<0x0000u>;

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
