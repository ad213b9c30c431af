// Shared argument checks, scale-factor rounding and saturation.
//
// Every primitive checks in one order and stops at the first failure:
// null pointers, spec identifiers, sizes, steps, then its own arguments.
// The helpers below are the building blocks; a family composes them in its
// documented order, e.g.
//
//     if (Status s = checkFirst(anyNull(pSrc, pDst), badRoi(roi),
//                               badSteps(srcStep, dstStep)))
//         return s;
#pragma once

#include "frame/abi.h"

#include <cstdint>
#include <limits>
#include <type_traits>

#include "zor.h"

namespace zor { inline namespace ZOR_INLINE_NS {

// ---- checks --------------------------------------------------------------

template <class... P>
constexpr Status anyNull(const P*... p) {
    return ((p == nullptr) || ...) ? StatusNullPointer : StatusOk;
}

constexpr Status badLength(int len) { return len < 1 ? StatusBadSize : StatusOk; }

constexpr Status badRoi(ImageSize roi) {
    return (roi.width < 1 || roi.height < 1) ? StatusBadSize : StatusOk;
}

template <class... S>
constexpr Status badSteps(S... steps) {
    return ((steps < 1) || ...) ? StatusBadStep : StatusOk;
}

// The first non-OK status of the checks, in argument order.
template <class... S>
constexpr Status checkFirst(S... checks) {
    Status result = StatusOk;
    ((result == StatusOk ? (result = checks, 0) : 0), ...);
    return result;
}

// ---- rounding and saturation ------------------------------------------------

// r * 2^-scaleFactor, rounded to nearest with ties to even (scaleFactor > 0),
// or shifted left (scaleFactor < 0, saturating to the int64 range so that a
// following saturate() clamps as the destination type demands).
constexpr int64_t scaleRound(int64_t r, int scaleFactor) {
    if (scaleFactor == 0) return r;
    if (scaleFactor > 0) {
        if (scaleFactor > 62) return 0;  // every representable r shifts to 0 (|r| < 2^62)
        const int64_t half = (int64_t(1) << (scaleFactor - 1)) - 1;
        return (r + half + ((r >> scaleFactor) & 1)) >> scaleFactor;
    }
    const int s = scaleFactor < -62 ? 62 : -scaleFactor;  // (INT_MIN has no negation)
    if (r == 0) return 0;
    if (s >= 62) return r > 0 ? std::numeric_limits<int64_t>::max()
                              : std::numeric_limits<int64_t>::min();
    const int64_t limit = std::numeric_limits<int64_t>::max() >> s;
    if (r > limit) return std::numeric_limits<int64_t>::max();
    if (r < -limit) return std::numeric_limits<int64_t>::min();
    return r * (int64_t(1) << s);
}

// Rounds half up: the _NR members' rule.
constexpr int64_t scaleRoundHalfUp(int64_t r, int scaleFactor) {
    if (scaleFactor <= 0) return scaleRound(r, scaleFactor);
    if (scaleFactor > 62) return 0;
    return (r + (int64_t(1) << (scaleFactor - 1))) >> scaleFactor;
}

// Clamps an integer to the range of T.
template <class T, class V>
constexpr T saturate(V v) {
    static_assert(std::is_integral_v<T> && std::is_integral_v<V>);
    using L = std::numeric_limits<T>;
    if constexpr (std::is_signed_v<V>) {
        if (v < 0 && (!std::is_signed_v<T> || int64_t(v) < int64_t(L::min()))) return L::min();
    }
    if (v > 0 && uint64_t(v) > uint64_t(L::max())) return L::max();
    return static_cast<T>(v);
}

// Rounds a double to nearest, ties to even, independent of the FPU mode.
inline double roundEven(double x) {
    // 2^52: adding and subtracting it drops the fraction with the hardware's
    // default ties-to-even rounding; larger magnitudes are already whole.
    constexpr double k = 4503599627370496.0;
    if (!(x < k && x > -k)) return x;
    volatile double t = x >= 0 ? x + k : x - k;  // volatile: keep the double rounding step
    double r = x >= 0 ? t - k : t + k;
    return r == 0 ? (x < 0 ? -0.0 : 0.0) : r;
}

// Converts a double to T: NaN to T's lowest value for signed T and to 0 for
// unsigned T, ties to even, saturated.
template <class T>
inline T saturateRound(double x) {
    using L = std::numeric_limits<T>;
    if (x != x) return std::is_signed_v<T> ? L::min() : T(0);
    const double r = roundEven(x);
    if (r <= double(L::min())) return L::min();
    if (r >= double(L::max())) return L::max();
    return static_cast<T>(static_cast<int64_t>(r));
}

}}  // namespace zor::ZOR_INLINE_NS
