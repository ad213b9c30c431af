// The SSE control and status register around float-to-integer conversions.
//
// cvtps2dq rounds by the mode that MXCSR holds, and it raises the sticky
// invalid-operation flag exactly for the inputs it cannot represent: NaN and
// values outside the int32 range, for which it returns INT_MIN.
// ConversionScope uses both:
//
// - While it lives, conversions round to nearest with ties to even, whatever
//   mode the caller left.
// - run(pass) converts a stretch without clamps, pass(false), fast for the
//   usual inputs, and only if such an input went by again the clamped way,
//   pass(true).  The pass must do its converting in calls of their own
//   (non-inlined functions): a call cannot be reordered with the reads of
//   MXCSR.
//
// On exit the caller's rounding mode is back, and the invalid flag is raised
// if it was on entry or a clamped pass raised it, as clamped code alone would
// leave it.  With the invalid exception unmasked a fast pass could trap, so
// then armed() is false and the caller takes its element-by-element path.
#pragma once

#include "frame/abi.h"

#include <cstdint>

#if ZOR_SIMD >= 2
#  include <emmintrin.h>

namespace zor { inline namespace ZOR_INLINE_NS {

class ConversionScope {
public:
    ConversionScope() : entry_(_mm_getcsr()) {
        const unsigned want = entry_ & ~kRounding & (armed() ? ~kInvalid : ~0u);
        if (want != entry_) _mm_setcsr(want);
    }
    ~ConversionScope() {
        const unsigned now = _mm_getcsr();
        const unsigned back = (now & ~kRounding) | (entry_ & (kRounding | kInvalid)) | kept_;
        if (back != now) _mm_setcsr(back);
    }
    ConversionScope(const ConversionScope&) = delete;
    ConversionScope& operator=(const ConversionScope&) = delete;

    bool armed() const { return (entry_ & kInvalidMask) != 0; }

    // Only while armed(): the flags of the clamped pass are kept for the
    // caller, those of the unclamped one are not.
    template <class Pass>
    void run(Pass&& pass) {
        pass(false);
        if (take()) {
            pass(true);
            kept_ |= take();
        }
    }

private:
    static constexpr unsigned kInvalid = 0x0001, kInvalidMask = 0x0080, kRounding = 0x6000;

    // The invalid flag as it stands, cleared for the next pass.
    unsigned take() {
        if (!armed()) return 0;
        const unsigned c = _mm_getcsr();
        if (!(c & kInvalid)) return 0;
        _mm_setcsr(c & ~kInvalid);
        return kInvalid;
    }

    const unsigned entry_;
    unsigned kept_ = 0;
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
