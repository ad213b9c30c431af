// Typed lane operations: the one SIMD vocabulary of the family kernels.
//
// simd::Vec<T> is a register of lanes of type T (uint8_t ... int64_t, float,
// double) at the column's native width; Vec<T>::kLanes says how many.  The
// operations are free functions (and the arithmetic and bitwise operators)
// over Vec<T, Bytes>; each forwards to Isa<Bytes>, the one place that spells
// instructions.  A kernel written against the vocabulary names no width, so
// it compiles for every width that has an Isa: the 16-byte (SSE) registers
// of the five variants, and in the wide columns of the x86-64 build the
// 32-byte (AVX2) and 64-byte (AVX-512) ones (ZOR_WIDTH), with no second copy
// of the kernel.
//
//     using V = simd::Vec<int16_t>;
//     for (; i + V::kLanes <= n; i += V::kLanes)
//         store(d + i, addSat(load<V>(a + i), load<V>(b + i)));
//
// What exists in which column:
//   ZOR_SIMD >= 1  float lanes
//   ZOR_SIMD >= 2  every lane type
//   ZOR_SIMD >= 4  shuffleBytes, mulAddPairs on bytes, mulHiRound (and abs,
//                  alignBytes without emulation)
// simd::kHas<T> tells a template whether Vec<T> exists in this column.
//
// Lane order.  Operations act lane by lane and keep lane order, except those
// marked "per 16-byte block": widenLo/widenHi, toDoubleLo/toDoubleHi,
// gather*, narrow*, zipLo/zipHi, concatEven/concatOdd,
// transpose4, addPairs, shuffleBytes, alignBytes and shiftBytes* work
// within each 16-byte block of a wider register, as the hardware does.  widenLo/widenHi followed by narrow* restores the original
// order at every width, so kernels that widen, compute and narrow back need
// not care; loadWidened and reverseLanes keep (reverse) the order of the
// whole register.
//
// A kernel whose result depends on the width (a fixed accumulation order,
// lanes counted out per 16-byte block, a byte-shuffle table) names it:
// Vec<T, 16>.  It then runs at 16 bytes in every column, wider ones too.
//
// Every operation is exact and defined for every input; float operations
// follow IEEE rules lane by lane (min/max: the second operand when either is
// NaN, as the instructions do; see min()).
//
// Include after frame/variant.h.
#pragma once

#include "frame/abi.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <limits>
#include <type_traits>

namespace zor { inline namespace ZOR_INLINE_NS { namespace simd {

// ---- scalar twins -------------------------------------------------------------
// The same names on plain lanes, so that an operation written once as a
// generic lambda serves the vector body and the scalar tail (see mapLanes).

// a < b ? a : b  and  a > b ? a : b: like the instructions, the second
// operand when the comparison fails (NaN included).
template <class T>
constexpr T min(T a, T b) { return a < b ? a : b; }
template <class T>
constexpr T max(T a, T b) { return a > b ? a : b; }

template <class T>
constexpr T addSat(T a, T b) {
    static_assert(std::is_integral_v<T> && sizeof(T) <= 2, "saturating add of 8/16-bit lanes");
    using L = std::numeric_limits<T>;
    const int r = int(a) + int(b);
    return T(r < int(L::min()) ? L::min() : r > int(L::max()) ? L::max() : r);
}
template <class T>
constexpr T subSat(T a, T b) {
    static_assert(std::is_integral_v<T> && sizeof(T) <= 2, "saturating subtract of 8/16-bit lanes");
    using L = std::numeric_limits<T>;
    const int r = int(a) - int(b);
    return T(r < int(L::min()) ? L::min() : r > int(L::max()) ? L::max() : r);
}
// (a + b + 1) >> 1 of unsigned lanes.
template <class T>
constexpr T avg(T a, T b) {
    static_assert(std::is_unsigned_v<T> && sizeof(T) <= 2, "rounding average of unsigned lanes");
    return T((unsigned(a) + unsigned(b) + 1) >> 1);
}
// (a b + 2^14) >> 15 of 16-bit lanes (the low 16 bits of it).
constexpr int16_t mulHiRound(int16_t a, int16_t b) { return int16_t((int(a) * b + 0x4000) >> 15); }
// |a - b| of unsigned lanes.
template <class T>
constexpr T absDiff(T a, T b) {
    static_assert(std::is_unsigned_v<T>, "absolute difference of unsigned lanes");
    return a > b ? T(a - b) : T(b - a);
}
// |a| of signed lanes; the lowest value stays as it is.  Floats: the sign
// bit cleared.
template <class T>
inline T abs(T a) {
    static_assert(std::is_signed_v<T>, "absolute value of signed lanes");
    if constexpr (std::is_integral_v<T>) {
        return a < 0 ? T(0u - static_cast<std::make_unsigned_t<T>>(a)) : a;
    } else {
        // the sign bit cleared, -0 and NaNs included, in integer registers
        // (an x87 load would quiet a signalling NaN)
        using U = std::conditional_t<sizeof(T) == 4, uint32_t, uint64_t>;
        U u;
        std::memcpy(&u, &a, sizeof u);
        u &= ~(U(1) << (8 * sizeof(T) - 1));
        std::memcpy(&a, &u, sizeof u);
        return a;
    }
}
// Comparisons give bool on lanes, masks on registers; select takes either.
template <class T>
constexpr bool eq(T a, T b) { return a == b; }
template <class T>
constexpr bool gt(T a, T b) { return a > b; }
template <class T>
constexpr bool lt(T a, T b) { return a < b; }
template <class T>
constexpr bool ge(T a, T b) { return a >= b; }
template <class T>
constexpr bool le(T a, T b) { return a <= b; }
template <class T>
constexpr T select(bool mask, T a, T b) { return mask ? a : b; }
// Shifts: logical for unsigned lanes, arithmetic for signed ones.
template <int N, class T>
constexpr T shl(T a) { return T(static_cast<std::make_unsigned_t<T>>(a) << N); }
template <int N, class T>
constexpr T shr(T a) { return T(a >> N); }
// Shifts by a run-time count below the lane's bit width.
template <class T, std::enable_if_t<std::is_integral_v<T>, int> = 0>
constexpr T shl(T a, int n) { return T(static_cast<std::make_unsigned_t<T>>(a) << n); }
template <class T, std::enable_if_t<std::is_integral_v<T>, int> = 0>
constexpr T shr(T a, int n) { return T(a >> n); }
// set1<T>(x) of a plain lane is x: set1<decltype(v)>(k) makes a constant
// for either form of a generic lambda's operand.
template <class T, std::enable_if_t<std::is_arithmetic_v<T>, int> = 0>
constexpr T set1(T x) { return x; }
// A comparison's outcome as lane values: all ones where it holds, else 0
// (a register's mask already is that).  asLanes<decltype(a)>(lt(a, b)).
template <class T, std::enable_if_t<std::is_integral_v<T>, int> = 0>
constexpr T asLanes(bool holds) { return holds ? T(~T(0)) : T(0); }

// A plain lane stands for a register of one lane, so that a kernel written
// over a register type V serves the generic variant with V = float:
// load<float>(p), store(p, x), set1<float>(x) (above), zero<float>(), lanesOf<V>,
// and the lane-order shuffles further down (deinterleave, interleave,
// transpose), which are identities on one lane.
template <class V>
inline std::enable_if_t<std::is_arithmetic_v<V>, V> load(const V* p) { return *p; }
template <class T>
inline std::enable_if_t<std::is_arithmetic_v<T>> store(T* p, T v) { *p = v; }
template <class V>
inline std::enable_if_t<std::is_arithmetic_v<V>, V> zero() { return V(0); }
template <class T>
inline std::enable_if_t<std::is_arithmetic_v<T>> deinterleave(T a, T b, T& even, T& odd) {
    even = a;
    odd = b;
}
template <class T>
inline std::enable_if_t<std::is_arithmetic_v<T>> interleave(T even, T odd, T& lo, T& hi) {
    lo = even;
    hi = odd;
}
template <class T>
inline std::enable_if_t<std::is_arithmetic_v<T>> transpose(T (&)[1]) {}

// ---- registers --------------------------------------------------------------

template <class T, int Bytes, class Enable = void>
struct RawOf {  // no register of this lane type at this width
    static constexpr bool kExists = false;
};

#if ZOR_SIMD >= 1
constexpr int kNativeBytes = ZOR_WIDTH;
template <>
struct RawOf<float, 16> {
    using type = __m128;
    static constexpr bool kExists = true;
};
#else
constexpr int kNativeBytes = 0;
#endif
#if ZOR_SIMD >= 2
template <>
struct RawOf<double, 16> {
    using type = __m128d;
    static constexpr bool kExists = true;
};
template <class T>
struct RawOf<T, 16, std::enable_if_t<std::is_integral_v<T> && !std::is_same_v<T, bool>>> {
    using type = __m128i;
    static constexpr bool kExists = true;
};
#endif

#if ZOR_WIDTH >= 32
template <>
struct RawOf<float, 32> {
    using type = __m256;
    static constexpr bool kExists = true;
};
template <>
struct RawOf<double, 32> {
    using type = __m256d;
    static constexpr bool kExists = true;
};
template <class T>
struct RawOf<T, 32, std::enable_if_t<std::is_integral_v<T> && !std::is_same_v<T, bool>>> {
    using type = __m256i;
    static constexpr bool kExists = true;
};
#endif
#if ZOR_WIDTH >= 64
template <>
struct RawOf<float, 64> {
    using type = __m512;
    static constexpr bool kExists = true;
};
template <>
struct RawOf<double, 64> {
    using type = __m512d;
    static constexpr bool kExists = true;
};
template <class T>
struct RawOf<T, 64, std::enable_if_t<std::is_integral_v<T> && !std::is_same_v<T, bool>>> {
    using type = __m512i;
    static constexpr bool kExists = true;
};
#endif

// Whether Vec<T> exists in this column.
template <class T>
constexpr bool kHas = RawOf<T, kNativeBytes>::kExists;

template <class T, int Bytes = kNativeBytes>
struct Vec {
    using Lane = T;
    using Raw = typename RawOf<T, Bytes>::type;
    static constexpr int kBytes = Bytes;
    static constexpr int kLanes = Bytes / int(sizeof(T));
    Raw raw;
};

// Lanes of a register type; 1 for a plain lane.
template <class V>
constexpr int lanesOf() {
    if constexpr (std::is_arithmetic_v<V>) return 1;
    else return V::kLanes;
}

// The lane type twice as wide, keeping signedness.
template <class T>
using Wider = std::conditional_t<
    std::is_same_v<T, float>, double,
    std::conditional_t<std::is_signed_v<T>,
                       std::conditional_t<sizeof(T) == 1, int16_t, std::conditional_t<sizeof(T) == 2, int32_t, int64_t>>,
                       std::conditional_t<sizeof(T) == 1, uint16_t, std::conditional_t<sizeof(T) == 2, uint32_t, uint64_t>>>>;

template <int Bytes>
struct Isa;  // the instructions of one register width

#if ZOR_SIMD >= 4
// Shuffle masks between a 48-byte interleaved block of three byte channels
// and three channel registers: m[3 k + r] takes register r's share of
// output k (loadInterleaved3 / storeInterleaved3).
struct InterleaveMasks {
    uint8_t m[9][16];
};
constexpr InterleaveMasks interleaveMasks(bool toInterleaved) {
    InterleaveMasks t{};
    for (int k = 0; k < 3; ++k)
        for (int r = 0; r < 3; ++r)
            for (int j = 0; j < 16; ++j) {
                // loading: output k = channel k, byte j from block byte 3j + k;
                // storing: output k = block register k, byte j = channel (16k+j) % 3
                const int from = toInterleaved ? ((16 * k + j) / 3) + 16 * ((16 * k + j) % 3) : 3 * j + k;
                t.m[3 * k + r][j] = from / 16 == r ? static_cast<uint8_t>(from % 16) : uint8_t(0x80);
            }
    return t;
}
#endif

#if ZOR_SIMD >= 1
// ---- 16-byte registers: SSE ... SSSE3 ---------------------------------------
template <>
struct Isa<16> {
    template <class T>
    using R = typename RawOf<T, 16>::type;

    template <class T>
    static constexpr bool isF = std::is_same_v<T, float>;
    template <class T>
    static constexpr bool isD = std::is_same_v<T, double>;
    template <class T>
    static constexpr bool isInt = std::is_integral_v<T>;

    // -- memory
    template <class T>
    static R<T> zero() {
        if constexpr (isF<T>) return _mm_setzero_ps();
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_setzero_pd();
        else return _mm_setzero_si128();
#  endif
    }
    template <class T>
    static R<T> set1(T x) {
        if constexpr (isF<T>) return _mm_set1_ps(x);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_set1_pd(x);
        else if constexpr (sizeof(T) == 1) return _mm_set1_epi8(static_cast<char>(x));
        else if constexpr (sizeof(T) == 2) return _mm_set1_epi16(static_cast<short>(x));
        else if constexpr (sizeof(T) == 4) return _mm_set1_epi32(static_cast<int>(x));
        else return _mm_set1_epi64x(static_cast<long long>(x));
#  endif
    }
    template <class T>
    static R<T> load(const T* p) {
        if constexpr (isF<T>) return _mm_loadu_ps(p);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_loadu_pd(p);
        else return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
#  endif
    }
    template <class T>
    static R<T> loadAligned(const T* p) {
        if constexpr (isF<T>) return _mm_load_ps(p);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_load_pd(p);
        else return _mm_load_si128(reinterpret_cast<const __m128i*>(p));
#  endif
    }
    template <class T>
    static R<T> loadBlocks(const T* p, ptrdiff_t) { return load<T>(p); }
    template <class T>
    static R<T> loadBlocksAt(const T* const* blocks, ptrdiff_t offset) { return load<T>(blocks[0] + offset); }
    template <class T>
    static void storeBlocks(T* p, ptrdiff_t, R<T> v) { store<T>(p, v); }
    template <class T, class F>
    static void eachBlock(R<T> v, int first, F&& f) { f(first, v); }
    // The lower half of a register from memory, the upper half zero.
    template <class T>
    static R<T> loadHalf(const T* p) {
        if constexpr (isF<T>) {
            // movq from SSE2 on: no dependency on an older register value
#  if ZOR_SIMD >= 2
            return _mm_castsi128_ps(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)));
#  else
            return _mm_loadl_pi(_mm_setzero_ps(), reinterpret_cast<const __m64*>(p));
#  endif
        }
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_load_sd(p);
        else return _mm_loadl_epi64(reinterpret_cast<const __m128i*>(p));
#  endif
    }
    template <class T>
    static void store(T* p, R<T> v) {
        if constexpr (isF<T>) _mm_storeu_ps(p, v);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) _mm_storeu_pd(p, v);
        else _mm_storeu_si128(reinterpret_cast<__m128i*>(p), v);
#  endif
    }
    template <class T>
    static void storeAligned(T* p, R<T> v) {
        if constexpr (isF<T>) _mm_store_ps(p, v);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) _mm_store_pd(p, v);
        else _mm_store_si128(reinterpret_cast<__m128i*>(p), v);
#  endif
    }
    template <class T>
    static void storeHalf(T* p, R<T> v) {
        if constexpr (isF<T>) _mm_storel_pi(reinterpret_cast<__m64*>(p), v);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) _mm_store_sd(p, v);
        else _mm_storel_epi64(reinterpret_cast<__m128i*>(p), v);
#  endif
    }
    // Non-temporal store to 16-byte aligned memory.
    template <class T>
    static void stream(T* p, R<T> v) {
        if constexpr (isF<T>) _mm_stream_ps(p, v);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) _mm_stream_pd(p, v);
        else _mm_stream_si128(reinterpret_cast<__m128i*>(p), v);
#  endif
    }

    // Asks for the cache line holding p (no fault for any address).
    static void prefetch(const void* p) { _mm_prefetch(static_cast<const char*>(p), _MM_HINT_T0); }

    // -- bitwise (any lane type)
    template <class T>
    static R<T> allOnes() {
        if constexpr (isF<T>) return _mm_cmpeq_ps(_mm_setzero_ps(), _mm_setzero_ps());
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_cmpeq_pd(_mm_setzero_pd(), _mm_setzero_pd());
        else return _mm_set1_epi32(-1);
#  endif
    }
    template <class T>
    static R<T> bitAnd(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_and_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_and_pd(a, b);
        else return _mm_and_si128(a, b);
#  endif
    }
    template <class T>
    static R<T> bitOr(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_or_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_or_pd(a, b);
        else return _mm_or_si128(a, b);
#  endif
    }
    template <class T>
    static R<T> bitXor(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_xor_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_xor_pd(a, b);
        else return _mm_xor_si128(a, b);
#  endif
    }
    // ~a & b
    template <class T>
    static R<T> andNot(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_andnot_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_andnot_pd(a, b);
        else return _mm_andnot_si128(a, b);
#  endif
    }

    // -- float arithmetic (SSE) and the rest (SSE2)
    template <class T>
    static R<T> add(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_add_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_add_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm_add_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_add_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_add_epi32(a, b);
        else return _mm_add_epi64(a, b);
#  endif
    }
    template <class T>
    static R<T> sub(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_sub_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_sub_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm_sub_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_sub_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_sub_epi32(a, b);
        else return _mm_sub_epi64(a, b);
#  endif
    }
    // Low half of the product for integer lanes (16 and 32 bits).
    template <class T>
    static R<T> mul(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_mul_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_mul_pd(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_mullo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) {
            const __m128i even = _mm_mul_epu32(a, b);
            const __m128i odd = _mm_mul_epu32(_mm_srli_epi64(a, 32), _mm_srli_epi64(b, 32));
            return _mm_unpacklo_epi32(_mm_shuffle_epi32(even, 0x08), _mm_shuffle_epi32(odd, 0x08));
        }
#  endif
        else static_assert(sizeof(T) == 0, "no lane multiply for this type");
    }
    template <class T>
    static R<T> div(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_div_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_div_pd(a, b);
#  endif
        else static_assert(sizeof(T) == 0, "division of float lanes only");
    }
    template <class T>
    static R<T> sqrt(R<T> a) {
        if constexpr (isF<T>) return _mm_sqrt_ps(a);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_sqrt_pd(a);
#  endif
        else static_assert(sizeof(T) == 0, "square root of float lanes only");
    }

#  if ZOR_SIMD >= 2
    // The sign bit of each lane: flipping it maps unsigned order onto signed.
    template <class T>
    static __m128i signBits() {
        if constexpr (sizeof(T) == 1) return _mm_set1_epi8(char(0x80));
        else if constexpr (sizeof(T) == 2) return _mm_set1_epi16(short(0x8000));
        else return _mm_set1_epi32(int(0x80000000u));
    }
#  endif

    // -- comparisons: all ones where the relation holds, else zero
    template <class T>
    static R<T> eq(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_cmpeq_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_cmpeq_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm_cmpeq_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_cmpeq_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_cmpeq_epi32(a, b);
#  endif
        else static_assert(sizeof(T) == 0, "no 64-bit integer compare");
    }
    // a > b
    template <class T>
    static R<T> gt(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_cmpgt_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_cmpgt_pd(a, b);
        else if constexpr (std::is_unsigned_v<T> && sizeof(T) <= 4) {
            const __m128i s = signBits<T>();
            return gt<std::make_signed_t<T>>(_mm_xor_si128(a, s), _mm_xor_si128(b, s));
        } else if constexpr (sizeof(T) == 1) return _mm_cmpgt_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_cmpgt_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_cmpgt_epi32(a, b);
#  endif
        else static_assert(sizeof(T) == 0, "no 64-bit integer compare");
    }
    // a >= b (false for NaN lanes)
    template <class T>
    static R<T> ge(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_cmpge_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_cmpge_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm_cmpeq_epi8(_mm_max_epu8(a, b), a);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_cmpeq_epi16(_mm_max_epi16(a, b), a);
        else return _mm_xor_si128(gt<T>(b, a), _mm_set1_epi32(-1));
#  endif
    }

    // -- min / max: for floats the second operand when either is NaN
    template <class T>
    static R<T> min(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_min_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_min_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm_min_epu8(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_min_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_sub_epi16(a, _mm_subs_epu16(a, b));
        else return select<T>(gt<T>(a, b), b, a);
#  endif
    }
    template <class T>
    static R<T> max(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_max_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_max_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm_max_epu8(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_max_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_add_epi16(b, _mm_subs_epu16(a, b));
        else return select<T>(gt<T>(a, b), a, b);
#  endif
    }
    // mask ? a : b, bit by bit.
    template <class T>
    static R<T> select(R<T> mask, R<T> a, R<T> b) {
        return bitOr<T>(bitAnd<T>(mask, a), andNot<T>(mask, b));
    }

#  if ZOR_SIMD >= 2
    // -- integer lanes only
    template <class T>
    static __m128i addSat(__m128i a, __m128i b) {
        if constexpr (std::is_same_v<T, uint8_t>) return _mm_adds_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm_adds_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_adds_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_adds_epi16(a, b);
        else static_assert(sizeof(T) == 0, "saturating add of 8/16-bit lanes");
    }
    template <class T>
    static __m128i subSat(__m128i a, __m128i b) {
        if constexpr (std::is_same_v<T, uint8_t>) return _mm_subs_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm_subs_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_subs_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_subs_epi16(a, b);
        else static_assert(sizeof(T) == 0, "saturating subtract of 8/16-bit lanes");
    }
    template <class T>
    static __m128i avg(__m128i a, __m128i b) {
        if constexpr (std::is_same_v<T, uint8_t>) return _mm_avg_epu8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_avg_epu16(a, b);
        else static_assert(sizeof(T) == 0, "rounding average of unsigned 8/16-bit lanes");
    }
    // High half of the 16 x 16-bit product.
    template <class T>
    static __m128i mulHi(__m128i a, __m128i b) {
        if constexpr (std::is_same_v<T, int16_t>) return _mm_mulhi_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm_mulhi_epu16(a, b);
        else static_assert(sizeof(T) == 0, "high product of 16-bit lanes");
    }
    // Shifts by a constant: logical for unsigned lanes, arithmetic for signed.
    template <class T, int N>
    static __m128i shl(__m128i a) {
        if constexpr (sizeof(T) == 1)
            return _mm_and_si128(_mm_slli_epi16(a, N), _mm_set1_epi8(char((0xFF << N) & 0xFF)));
        else if constexpr (sizeof(T) == 2) return _mm_slli_epi16(a, N);
        else if constexpr (sizeof(T) == 4) return _mm_slli_epi32(a, N);
        else return _mm_slli_epi64(a, N);
    }
    template <class T, int N>
    static __m128i shr(__m128i a) {
        if constexpr (std::is_same_v<T, uint8_t>)
            return _mm_and_si128(_mm_srli_epi16(a, N), _mm_set1_epi8(char(0xFF >> N)));
        else if constexpr (std::is_same_v<T, int8_t>) {
            const __m128i lo = _mm_srai_epi16(_mm_slli_epi16(a, 8), N + 8);
            const __m128i hi = _mm_srai_epi16(a, N);
            return _mm_or_si128(_mm_and_si128(lo, _mm_set1_epi16(0x00FF)),
                                _mm_andnot_si128(_mm_set1_epi16(0x00FF), hi));
        } else if constexpr (std::is_same_v<T, uint16_t>) return _mm_srli_epi16(a, N);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_srai_epi16(a, N);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm_srli_epi32(a, N);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm_srai_epi32(a, N);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm_srli_epi64(a, N);
        else static_assert(sizeof(T) == 0, "no arithmetic shift of 64-bit lanes");
    }
    // Shifts by a run-time count (16, 32 and 64-bit lanes).
    template <class T>
    static __m128i shl(__m128i a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (sizeof(T) == 2) return _mm_sll_epi16(a, c);
        else if constexpr (sizeof(T) == 4) return _mm_sll_epi32(a, c);
        else if constexpr (sizeof(T) == 8) return _mm_sll_epi64(a, c);
        else static_assert(sizeof(T) == 0, "run-time shifts of 16/32/64-bit lanes");
    }
    template <class T>
    static __m128i shr(__m128i a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (std::is_same_v<T, uint16_t>) return _mm_srl_epi16(a, c);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm_sra_epi16(a, c);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm_srl_epi32(a, c);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm_sra_epi32(a, c);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm_srl_epi64(a, c);
        else static_assert(sizeof(T) == 0, "run-time shifts of 16/32/64-bit lanes");
    }

    // -- widening and narrowing, per 16-byte block
    // Lanes 0 .. n/2-1 (lo) or n/2 .. n-1 (hi) of a, widened to twice their
    // size: zero-extended from unsigned, sign-extended from signed lanes.
    template <class T>
    static __m128i extension(__m128i a) {
        if constexpr (std::is_unsigned_v<T>) return _mm_setzero_si128();
        else if constexpr (sizeof(T) == 1) return _mm_cmpgt_epi8(_mm_setzero_si128(), a);
        else if constexpr (sizeof(T) == 2) return _mm_srai_epi16(a, 15);
        else return _mm_srai_epi32(a, 31);
    }
    template <class T>
    static __m128i widenLo(__m128i a) {
        const __m128i e = extension<T>(a);
        if constexpr (sizeof(T) == 1) return _mm_unpacklo_epi8(a, e);
        else if constexpr (sizeof(T) == 2) return _mm_unpacklo_epi16(a, e);
        else return _mm_unpacklo_epi32(a, e);
    }
    template <class T>
    static __m128i widenHi(__m128i a) {
        const __m128i e = extension<T>(a);
        if constexpr (sizeof(T) == 1) return _mm_unpackhi_epi8(a, e);
        else if constexpr (sizeof(T) == 2) return _mm_unpackhi_epi16(a, e);
        else return _mm_unpackhi_epi32(a, e);
    }
    // Saturating narrowing of two registers of From lanes into To lanes.
    template <class To, class From>
    static __m128i narrowSat(__m128i lo, __m128i hi) {
        if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, uint8_t>)
            return _mm_packus_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, int8_t>)
            return _mm_packs_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, uint16_t> && std::is_same_v<To, uint8_t>) {
            const __m128i top = _mm_set1_epi16(255);
            return _mm_packus_epi16(min<uint16_t>(lo, top), min<uint16_t>(hi, top));
        } else if constexpr (std::is_same_v<From, int32_t> && std::is_same_v<To, int16_t>)
            return _mm_packs_epi32(lo, hi);
        else if constexpr (std::is_same_v<From, int32_t> && std::is_same_v<To, uint16_t>) {
            // clamp to 0..65535, move into the signed range, pack, move back
            const __m128i bias = _mm_set1_epi32(32768), zero = _mm_setzero_si128();
            const __m128i l = _mm_sub_epi32(_mm_and_si128(lo, _mm_cmpgt_epi32(lo, zero)), bias);
            const __m128i h = _mm_sub_epi32(_mm_and_si128(hi, _mm_cmpgt_epi32(hi, zero)), bias);
            return _mm_xor_si128(_mm_packs_epi32(l, h), _mm_set1_epi16(short(0x8000)));
        } else static_assert(sizeof(To) == 0, "no such saturating narrowing");
    }
    // Narrowing that keeps the low bits of each lane.
    template <class To, class From>
    static __m128i narrowTrunc(__m128i lo, __m128i hi) {
        if constexpr (sizeof(From) == 2 && sizeof(To) == 1) {
            const __m128i m = _mm_set1_epi16(0x00FF);
            return _mm_packus_epi16(_mm_and_si128(lo, m), _mm_and_si128(hi, m));
        } else if constexpr (sizeof(From) == 4 && sizeof(To) == 2) {
            const __m128i l = _mm_srai_epi32(_mm_slli_epi32(lo, 16), 16);
            const __m128i h = _mm_srai_epi32(_mm_slli_epi32(hi, 16), 16);
            return _mm_packs_epi32(l, h);
        } else static_assert(sizeof(To) == 0, "no such truncating narrowing");
    }
    // pmaddwd: a0 b0 + a1 b1 of neighbouring 16-bit lanes, as 32-bit lanes.
    static __m128i mulAddPairs16(__m128i a, __m128i b) { return _mm_madd_epi16(a, b); }
    // psadbw: per 8 bytes the sum of |a - b|, in the low 16 bits of a 64-bit lane.
    static __m128i sumAbsDiff8(__m128i a, __m128i b) { return _mm_sad_epu8(a, b); }
    // Byte shifts of the whole register (per 16-byte block).
    template <int N>
    static __m128i shiftBytesUp(__m128i a) { return _mm_slli_si128(a, N); }
    template <int N>
    static __m128i shiftBytesDown(__m128i a) { return _mm_srli_si128(a, N); }
    // One bit per byte, lane order.
    static int byteMask(__m128i a) { return _mm_movemask_epi8(a); }
    // Bytes N .. N+15 of the 32-byte value hi:lo (per 16-byte block):
    // palignr from SSSE3; before it a shuffle of halves (N = 8) or two byte
    // shifts.
    template <int N, class T>
    static R<T> alignBytes(R<T> hi, R<T> lo) {
        static_assert(N >= 0 && N <= 16, "alignBytes takes 0 .. 16 bytes");
        if constexpr (N == 0) {
            return lo;
        } else if constexpr (N == 16) {
            return hi;
        } else if constexpr (N == 8 && !isInt<T>) {  // float lanes stay in the float unit
            const __m128d h = bitcast<double, T>(hi), l = bitcast<double, T>(lo);
            return bitcast<T, double>(_mm_shuffle_pd(l, h, 1));
        } else {
            const __m128i h = bitcast<int32_t, T>(hi), l = bitcast<int32_t, T>(lo);
#    if ZOR_SIMD >= 4
            return bitcast<T, int32_t>(_mm_alignr_epi8(h, l, N));
#    else
            if constexpr (N == 8)
                return bitcast<T, int32_t>(_mm_castpd_si128(_mm_shuffle_pd(_mm_castsi128_pd(l), _mm_castsi128_pd(h), 1)));
            else
                return bitcast<T, int32_t>(_mm_or_si128(_mm_srli_si128(l, N), _mm_slli_si128(h, 16 - N)));
#    endif
        }
    }

    // Sums of neighbouring 32-bit lanes: a0+a1, a2+a3, b0+b1, b2+b3.
    template <class T>
    static R<T> addPairs(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "pair sums of 32-bit lanes");
        if constexpr (isF<T>) {
#    if ZOR_SIMD >= 3
            return _mm_hadd_ps(a, b);
#    else
            return _mm_add_ps(_mm_shuffle_ps(a, b, 0x88), _mm_shuffle_ps(a, b, 0xDD));
#    endif
        } else {
#    if ZOR_SIMD >= 4
            return _mm_hadd_epi32(a, b);
#    else
            const __m128 x = _mm_castsi128_ps(a), y = _mm_castsi128_ps(b);
            return _mm_add_epi32(_mm_castps_si128(_mm_shuffle_ps(x, y, 0x88)),
                                 _mm_castps_si128(_mm_shuffle_ps(x, y, 0xDD)));
#    endif
        }
    }

    // Three interleaved byte channels, 48 bytes a0 b0 c0 a1 b1 c1 ..., as
    // three registers of 16 lanes each, and back.
    static void loadInterleaved3(const uint8_t* p, __m128i& a, __m128i& b, __m128i& c) {
        const __m128i v0 = load<uint8_t>(p), v1 = load<uint8_t>(p + 16), v2 = load<uint8_t>(p + 32);
#    if ZOR_SIMD >= 4
        // byte j of channel k is byte 3j + k of the block: three shuffles each
        alignas(16) static constexpr auto masks = interleaveMasks(false);
        const __m128i* m = reinterpret_cast<const __m128i*>(masks.m);
        __m128i out[3];
        for (int k = 0; k < 3; ++k)
            out[k] = _mm_or_si128(_mm_or_si128(_mm_shuffle_epi8(v0, m[3 * k]), _mm_shuffle_epi8(v1, m[3 * k + 1])),
                                  _mm_shuffle_epi8(v2, m[3 * k + 2]));
        a = out[0], b = out[1], c = out[2];
#    else
        // Four rounds of one fixed byte interleaving of the 48 bytes leave
        // every third byte together (the permutation's fourth power).
        __m128i x[3] = {v0, v1, v2};
        for (int round = 0; round < 4; ++round) {
            const __m128i y0 = _mm_unpacklo_epi8(x[0], _mm_unpackhi_epi64(x[1], x[1]));
            const __m128i y1 = _mm_unpacklo_epi8(_mm_unpackhi_epi64(x[0], x[0]), x[2]);
            const __m128i y2 = _mm_unpacklo_epi8(x[1], _mm_unpackhi_epi64(x[2], x[2]));
            x[0] = y0, x[1] = y1, x[2] = y2;
        }
        a = x[0], b = x[1], c = x[2];
#    endif
    }
    static void storeInterleaved3(uint8_t* p, __m128i a, __m128i b, __m128i c) {
#    if ZOR_SIMD >= 4
        alignas(16) static constexpr auto masks = interleaveMasks(true);
        const __m128i* m = reinterpret_cast<const __m128i*>(masks.m);
        const __m128i in[3] = {a, b, c};
        for (int r = 0; r < 3; ++r)
            store<uint8_t>(p + 16 * r, _mm_or_si128(_mm_or_si128(_mm_shuffle_epi8(in[0], m[3 * r]),
                                                                 _mm_shuffle_epi8(in[1], m[3 * r + 1])),
                                                    _mm_shuffle_epi8(in[2], m[3 * r + 2])));
#    else
        // The rounds of loadInterleaved3 undone: each takes the even and the
        // odd bytes of the registers apart again.
        const __m128i low = _mm_set1_epi16(0x00FF);
        const auto even = [&](__m128i u, __m128i v) {
            return _mm_packus_epi16(_mm_and_si128(u, low), _mm_and_si128(v, low));
        };
        __m128i x[3] = {a, b, c};
        for (int round = 0; round < 4; ++round) {
            const __m128i o0 = _mm_srli_epi16(x[0], 8), o1 = _mm_srli_epi16(x[1], 8), o2 = _mm_srli_epi16(x[2], 8);
            const __m128i y0 = even(x[0], x[1]);
            const __m128i y1 = _mm_packus_epi16(_mm_and_si128(x[2], low), o0);
            const __m128i y2 = _mm_packus_epi16(o1, o2);
            x[0] = y0, x[1] = y1, x[2] = y2;
        }
        store<uint8_t>(p, x[0]);
        store<uint8_t>(p + 16, x[1]);
        store<uint8_t>(p + 32, x[2]);
#    endif
    }

    // -- conversions
    static __m128 int32ToFloat(__m128i a) { return _mm_cvtepi32_ps(a); }
    // By the rounding mode that MXCSR holds (nearest-even unless changed);
    // INT_MIN for NaN and out-of-range lanes.
    static __m128i floatToInt32(__m128 a) { return _mm_cvtps_epi32(a); }
    static __m128i floatToInt32Trunc(__m128 a) { return _mm_cvttps_epi32(a); }
    static __m128d floatToDoubleLo(__m128 a) { return _mm_cvtps_pd(a); }
    static __m128d floatToDoubleHi(__m128 a) { return _mm_cvtps_pd(_mm_movehl_ps(a, a)); }
    static __m128 doubleToFloat(__m128d lo, __m128d hi) {
        return _mm_movelh_ps(_mm_cvtpd_ps(lo), _mm_cvtpd_ps(hi));
    }
    static __m128 doubleToFloatInOrder(__m128d lo, __m128d hi) { return doubleToFloat(lo, hi); }
    static __m128d int32ToDoubleLo(__m128i a) { return _mm_cvtepi32_pd(a); }
    static __m128d int32ToDoubleHi(__m128i a) { return _mm_cvtepi32_pd(_mm_shuffle_epi32(a, 0x0E)); }
    // t[i0], t[i1] (t[i2], t[i3]): two loads addressed from general
    // registers (the indices read as unsigned: no sign extension).
    // Lanes 0 and 1 as unsigned integers, through memory (the compiler may
    // turn this into register transfers).
    static void twoIndices(__m128i i, uint32_t& i0, uint32_t& i1) {
        alignas(16) uint32_t lanes[4];
        _mm_store_si128(reinterpret_cast<__m128i*>(lanes), i);
        i0 = lanes[0];
        i1 = lanes[1];
    }
    static __m128d gatherDoubleLo(const double* t, __m128i i) {
        uint32_t i0, i1;
        twoIndices(i, i0, i1);
        return _mm_loadh_pd(_mm_load_sd(t + i0), t + i1);
    }
    static __m128d gatherDoubleHi(const double* t, __m128i i) { return gatherDoubleLo(t, _mm_unpackhi_epi64(i, i)); }
    // t[i[0]], t[i[1]]: indices read from memory.
    static __m128d gatherDouble(const double* t, const int32_t* i) {
        return _mm_loadh_pd(_mm_load_sd(t + uint32_t(i[0])), t + uint32_t(i[1]));
    }
    // Rows of two doubles at t + i[0], t + i[1] (i[2], i[3]): their first
    // and second doubles.
    static void gatherRowsLo(const double* t, const int32_t* i, __m128d& first, __m128d& second) {
        const __m128d r0 = _mm_loadu_pd(t + uint32_t(i[0])), r1 = _mm_loadu_pd(t + uint32_t(i[1]));
        first = _mm_unpacklo_pd(r0, r1);
        second = _mm_unpackhi_pd(r0, r1);
    }
    static void gatherRowsHi(const double* t, const int32_t* i, __m128d& first, __m128d& second) {
        gatherRowsLo(t, i + 2, first, second);
    }
    static __m128i doubleToInt32(__m128d lo, __m128d hi) {
        return _mm_unpacklo_epi64(_mm_cvtpd_epi32(lo), _mm_cvtpd_epi32(hi));
    }
    static __m128i doubleToInt32Trunc(__m128d lo, __m128d hi) {
        return _mm_unpacklo_epi64(_mm_cvttpd_epi32(lo), _mm_cvttpd_epi32(hi));
    }
    // a0 + a1, b0 + b1
    static __m128d addPairs(__m128d a, __m128d b) {
#    if ZOR_SIMD >= 3
        return _mm_hadd_pd(a, b);
#    else
        return _mm_add_pd(_mm_unpacklo_pd(a, b), _mm_unpackhi_pd(a, b));
#    endif
    }
#  endif  // ZOR_SIMD >= 2

    // Even and odd lanes of the run a0 .. a3 b0 .. b3 (float lanes).
    static void deinterleave(__m128 a, __m128 b, __m128& even, __m128& odd) {
        even = _mm_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0));
        odd = _mm_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1));
    }
    static void interleave(__m128 even, __m128 odd, __m128& lo, __m128& hi) {
        lo = _mm_unpacklo_ps(even, odd);
        hi = _mm_unpackhi_ps(even, odd);
    }
    // Four registers of four float lanes as the rows of a square, transposed.
    static void transpose(__m128 (&r)[4]) { _MM_TRANSPOSE4_PS(r[0], r[1], r[2], r[3]); }

    // Interleaves the lower (upper) halves of a and b: a0 b0 a1 b1 ...
    template <class T>
    static R<T> zipLo(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_unpacklo_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_unpacklo_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm_unpacklo_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_unpacklo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_unpacklo_epi32(a, b);
        else return _mm_unpacklo_epi64(a, b);
#  endif
    }
    template <class T>
    static R<T> zipHi(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm_unpackhi_ps(a, b);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_unpackhi_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm_unpackhi_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm_unpackhi_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm_unpackhi_epi32(a, b);
        else return _mm_unpackhi_epi64(a, b);
#  endif
    }

    // One bit per lane of 32 or 64-bit lanes (their sign bits).
    template <class T>
    static int laneMask(R<T> a) {
        if constexpr (isF<T>) return _mm_movemask_ps(a);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_movemask_pd(a);
        else if constexpr (sizeof(T) == 4) return _mm_movemask_ps(_mm_castsi128_ps(a));
        else if constexpr (sizeof(T) == 8) return _mm_movemask_pd(_mm_castsi128_pd(a));
        else if constexpr (sizeof(T) == 2) return _mm_movemask_epi8(_mm_packs_epi16(a, _mm_setzero_si128()));
        else return _mm_movemask_epi8(a);
#  endif
    }

    // The lanes of a mask as bits (one per byte for integer lanes, one per
    // lane for float and double), and the value with every lane set.
    template <class T>
    static int maskBits(R<T> m) {
        if constexpr (isF<T>) return _mm_movemask_ps(m);
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_movemask_pd(m);
        else return _mm_movemask_epi8(m);
#  endif
    }
    template <class T>
    static constexpr int kMaskBitsPerLane = isInt<T> ? int(sizeof(T)) : 1;
    template <class T>
    static constexpr int kMaskFull = (1 << (16 / sizeof(T) * kMaskBitsPerLane<T>)) - 1;
    template <class T>
    static bool anyTrue(R<T> m) { return maskBits<T>(m) != 0; }
    template <class T>
    static bool allTrue(R<T> m) { return maskBits<T>(m) == kMaskFull<T>; }
    // The first set lane of a mask, the lane count when none is.
    template <class T>
    static int firstTrue(R<T> m) {
        return __builtin_ctz(unsigned(maskBits<T>(m)) | (unsigned(kMaskFull<T>) + 1u)) / kMaskBitsPerLane<T>;
    }

    // Lane I as a scalar.
    template <int I, class T>
    static T getLane(R<T> a) {
        static_assert(I >= 0 && I < 16 / int(sizeof(T)), "lane index out of range");
        if constexpr (isF<T>) return _mm_cvtss_f32(I == 0 ? a : _mm_shuffle_ps(a, a, I));
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_cvtsd_f64(I == 0 ? a : _mm_unpackhi_pd(a, a));
        else if constexpr (sizeof(T) == 1) return T(_mm_extract_epi16(a, I / 2) >> (8 * (I % 2)));
        else if constexpr (sizeof(T) == 2) return T(_mm_extract_epi16(a, I));
        else if constexpr (sizeof(T) == 4) return T(_mm_cvtsi128_si32(I == 0 ? a : _mm_shuffle_epi32(a, I)));
#  endif
        else static_assert(sizeof(T) == 0, "no lane access for 64-bit integers");
    }

    // Lane order reversed over the whole register.
    template <class T>
    static R<T> reverseLanes(R<T> a) {
        if constexpr (isF<T>) return _mm_shuffle_ps(a, a, _MM_SHUFFLE(0, 1, 2, 3));
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) return _mm_shuffle_pd(a, a, 1);
        else if constexpr (sizeof(T) == 8) return _mm_shuffle_epi32(a, _MM_SHUFFLE(1, 0, 3, 2));
        else if constexpr (sizeof(T) == 4) return _mm_shuffle_epi32(a, _MM_SHUFFLE(0, 1, 2, 3));
#    if ZOR_SIMD >= 4
        else if constexpr (sizeof(T) == 1)
            return _mm_shuffle_epi8(a, _mm_setr_epi8(15, 14, 13, 12, 11, 10, 9, 8, 7, 6, 5, 4, 3, 2, 1, 0));
#    endif
        else {
            const __m128i w = _mm_shufflehi_epi16(
                _mm_shufflelo_epi16(_mm_shuffle_epi32(a, _MM_SHUFFLE(0, 1, 2, 3)), _MM_SHUFFLE(2, 3, 0, 1)),
                _MM_SHUFFLE(2, 3, 0, 1));
            if constexpr (sizeof(T) == 2) return w;
            else return _mm_or_si128(_mm_slli_epi16(w, 8), _mm_srli_epi16(w, 8));  // bytes of each word swapped
        }
#  endif
    }
    // Per 16-byte block: lanes 0 and 2 (1 and 3) of a, then those of b, of
    // 32-bit lanes.
    template <class T>
    static R<T> concatEven(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatEven of 32-bit lanes");
        if constexpr (isF<T>) return _mm_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0));
#  if ZOR_SIMD >= 2
        else return _mm_castps_si128(_mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
#  endif
    }
    template <class T>
    static R<T> concatOdd(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatOdd of 32-bit lanes");
        if constexpr (isF<T>) return _mm_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1));
#  if ZOR_SIMD >= 2
        else return _mm_castps_si128(_mm_shuffle_ps(_mm_castsi128_ps(a), _mm_castsi128_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
#  endif
    }
    // Per 16-byte block: the 4 x 4 matrix of 32-bit lanes in a, b, c, d
    // (rows) transposed.
    template <class T>
    static void transpose4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        static_assert(sizeof(T) == 4, "transpose4 of 32-bit lanes");
        if constexpr (isF<T>) {
            _MM_TRANSPOSE4_PS(a, b, c, d);
        }
#  if ZOR_SIMD >= 2
        else {
            const __m128i t0 = _mm_unpacklo_epi32(a, b), t1 = _mm_unpackhi_epi32(a, b);
            const __m128i t2 = _mm_unpacklo_epi32(c, d), t3 = _mm_unpackhi_epi32(c, d);
            a = _mm_unpacklo_epi64(t0, t2);
            b = _mm_unpackhi_epi64(t0, t2);
            c = _mm_unpacklo_epi64(t1, t3);
            d = _mm_unpackhi_epi64(t1, t3);
        }
#  endif
    }
    // The 16-byte blocks of a, b, c, d transposed (see transposeBlocks4):
    // one block per register leaves them as they are.
    template <class T>
    static void transposeBlocks4(R<T>&, R<T>&, R<T>&, R<T>&) {}
    // About 12 bits of 1/a (rcpps).
    static __m128 recipApprox(__m128 a) { return _mm_rcp_ps(a); }

    // The float sums of reduceAdd through addss/addsd, which keep the
    // left operand first (the compiler may swap the operands of a plain +).
    template <class T>
    static T reduceAdd(R<T> a) {
        if constexpr (isF<T>) {
            const __m128 hi = _mm_movehl_ps(a, a);                                     // l2 l3
            const __m128 s02 = _mm_add_ss(a, hi);                                      // l0 + l2
            const __m128 s13 = _mm_add_ss(_mm_shuffle_ps(a, a, 1), _mm_shuffle_ps(hi, hi, 1));  // l1 + l3
            return _mm_cvtss_f32(_mm_add_ss(s02, s13));
        }
#  if ZOR_SIMD >= 2
        else if constexpr (isD<T>) {
            return _mm_cvtsd_f64(_mm_add_sd(a, _mm_unpackhi_pd(a, a)));
        }
#  endif
        else static_assert(sizeof(T) == 0, "reduceAdd of float lanes here");
    }

    // Reinterprets the bits.
    template <class To, class From>
    static R<To> bitcast(R<From> a) {
        // (compared by lane kind: naming __m128i as a template argument drops
        // its attributes, which the compiler warns about)
        if constexpr (std::is_same_v<To, From> || (isInt<To> && isInt<From>)) return a;
#  if ZOR_SIMD >= 2
        else if constexpr (isF<To> && isD<From>) return _mm_castpd_ps(a);
        else if constexpr (isD<To> && isF<From>) return _mm_castps_pd(a);
        else if constexpr (isF<To>) return _mm_castsi128_ps(a);
        else if constexpr (isD<To>) return _mm_castsi128_pd(a);
        else if constexpr (isF<From>) return _mm_castps_si128(a);
        else return _mm_castpd_si128(a);
#  endif
    }

#  if ZOR_SIMD >= 4
    // -- SSSE3
    // pshufb: byte i of the result is table[idx[i] & 15], or 0 where idx[i]
    // has its top bit set (per 16-byte block).
    static __m128i shuffleBytes(__m128i table, __m128i idx) { return _mm_shuffle_epi8(table, idx); }
    // pmaddubsw: u0 s0 + u1 s1 of neighbouring bytes (unsigned times signed),
    // saturated to 16 bits.
    static __m128i mulAddPairs8(__m128i u, __m128i s) { return _mm_maddubs_epi16(u, s); }
#  endif
#  if ZOR_SIMD >= 2
    // pmulhrsw: (a b + 2^14) >> 15 of 16-bit lanes.  Before SSSE3 from the
    // product's halves: 2 hi + ((lo >> 14) + 1) >> 1, lo taken unsigned.
    static __m128i mulHiRound(__m128i a, __m128i b) {
#    if ZOR_SIMD >= 4
        return _mm_mulhrs_epi16(a, b);
#    else
        const __m128i hi = _mm_mulhi_epi16(a, b);
        const __m128i q = _mm_srli_epi16(_mm_mullo_epi16(a, b), 14);
        return _mm_add_epi16(_mm_add_epi16(hi, hi), _mm_srli_epi16(_mm_add_epi16(q, _mm_set1_epi16(1)), 1));
#    endif
    }
    template <class T>
    static __m128i abs(__m128i a) {
#    if ZOR_SIMD >= 4
        if constexpr (sizeof(T) == 1) return _mm_abs_epi8(a);
        else if constexpr (sizeof(T) == 2) return _mm_abs_epi16(a);
        else return _mm_abs_epi32(a);
#    else
        // (a ^ s) - s with s the lane's sign spread over it; -MIN stays MIN
        const __m128i s = extension<T>(a);
        return sub<T>(_mm_xor_si128(a, s), s);
#    endif
    }
#  endif
};
#endif  // ZOR_SIMD >= 1

#if ZOR_WIDTH >= 32
// ---- wide registers: 32 bytes (AVX2) and 64 bytes (AVX-512) -------------------
// Isa<B> for B = 32 and 64 is built on Isa<B / 2>: every operation applied
// to the two halves (Halves<B>), which gives the per-16-byte-block
// semantics of the lane-order notes above by construction, and the whole-
// register operations (loads of half a register, reductions, lane masks,
// interleaving) composed from the halves' results in lane order.  The
// operations that carry the loops (memory, arithmetic, comparisons,
// conversions) are overridden with single instructions below; the rest run
// as two half-width instructions.

template <class V, class N>
V loadWidened(const N* p);

template <int Bytes>
struct Parts;  // the halves of a register: lo, hi, join

template <>
struct Parts<32> {
    template <class T>
    static auto lo(typename RawOf<T, 32>::type a) {
        if constexpr (std::is_same_v<T, float>) return _mm256_castps256_ps128(a);
        else if constexpr (std::is_same_v<T, double>) return _mm256_castpd256_pd128(a);
        else return _mm256_castsi256_si128(a);
    }
    template <class T>
    static auto hi(typename RawOf<T, 32>::type a) {
        if constexpr (std::is_same_v<T, float>) return _mm256_extractf128_ps(a, 1);
        else if constexpr (std::is_same_v<T, double>) return _mm256_extractf128_pd(a, 1);
        else return _mm256_extracti128_si256(a, 1);
    }
    template <class T>
    static typename RawOf<T, 32>::type join(typename RawOf<T, 16>::type l, typename RawOf<T, 16>::type h) {
        if constexpr (std::is_same_v<T, float>) return _mm256_insertf128_ps(_mm256_castps128_ps256(l), h, 1);
        else if constexpr (std::is_same_v<T, double>) return _mm256_insertf128_pd(_mm256_castpd128_pd256(l), h, 1);
        else return _mm256_inserti128_si256(_mm256_castsi128_si256(l), h, 1);
    }
};

#  if ZOR_WIDTH >= 64
template <>
struct Parts<64> {
    template <class T>
    static auto lo(typename RawOf<T, 64>::type a) {
        if constexpr (std::is_same_v<T, float>) return _mm512_castps512_ps256(a);
        else if constexpr (std::is_same_v<T, double>) return _mm512_castpd512_pd256(a);
        else return _mm512_castsi512_si256(a);
    }
    template <class T>
    static auto hi(typename RawOf<T, 64>::type a) {
        if constexpr (std::is_same_v<T, float>) return _mm512_extractf32x8_ps(a, 1);
        else if constexpr (std::is_same_v<T, double>) return _mm512_extractf64x4_pd(a, 1);
        else return _mm512_extracti64x4_epi64(a, 1);
    }
    template <class T>
    static typename RawOf<T, 64>::type join(typename RawOf<T, 32>::type l, typename RawOf<T, 32>::type h) {
        if constexpr (std::is_same_v<T, float>) return _mm512_insertf32x8(_mm512_castps256_ps512(l), h, 1);
        else if constexpr (std::is_same_v<T, double>) return _mm512_insertf64x4(_mm512_castpd256_pd512(l), h, 1);
        else return _mm512_inserti64x4(_mm512_castsi256_si512(l), h, 1);
    }
};
#  endif

template <int Bytes>
struct Halves {
    static constexpr int kHalf = Bytes / 2;
    using H = Isa<kHalf>;
    using P = Parts<Bytes>;
    template <class T>
    using R = typename RawOf<T, Bytes>::type;
    template <class T>
    static constexpr int kHalfLanes = kHalf / int(sizeof(T));

    template <class T>
    static auto lo(R<T> a) { return P::template lo<T>(a); }
    template <class T>
    static auto hi(R<T> a) { return P::template hi<T>(a); }
    template <class T, class L>
    static R<T> join(L l, L h) { return P::template join<T>(l, h); }
    // f on both halves: Out lanes from In lanes.
    template <class Out, class In, class F>
    static R<Out> each(R<In> a, F f) { return join<Out>(f(lo<In>(a)), f(hi<In>(a))); }
    template <class Out, class In, class F>
    static R<Out> each(R<In> a, R<In> b, F f) {
        return join<Out>(f(lo<In>(a), lo<In>(b)), f(hi<In>(a), hi<In>(b)));
    }

    // -- memory
    template <class T>
    static R<T> zero() { return join<T>(H::template zero<T>(), H::template zero<T>()); }
    template <class T>
    static R<T> set1(T x) { return join<T>(H::template set1<T>(x), H::template set1<T>(x)); }
    template <class T>
    static R<T> load(const T* p) { return join<T>(H::template load<T>(p), H::template load<T>(p + kHalfLanes<T>)); }
    template <class T>
    static R<T> loadAligned(const T* p) { return load<T>(p); }  // no fault on data aligned for half a register
    template <class T>
    static R<T> loadHalf(const T* p) { return join<T>(H::template load<T>(p), H::template zero<T>()); }
    template <class T>
    static R<T> loadBlocks(const T* p, ptrdiff_t blockStride) {
        return join<T>(H::template loadBlocks<T>(p, blockStride),
                       H::template loadBlocks<T>(p + blockStride * (kHalf / 16), blockStride));
    }
    template <class T>
    static R<T> loadBlocksAt(const T* const* blocks, ptrdiff_t offset) {
        return join<T>(H::template loadBlocksAt<T>(blocks, offset),
                       H::template loadBlocksAt<T>(blocks + kHalf / 16, offset));
    }
    template <class T>
    static void storeBlocks(T* p, ptrdiff_t blockStride, R<T> v) {
        H::template storeBlocks<T>(p, blockStride, lo<T>(v));
        H::template storeBlocks<T>(p + blockStride * (kHalf / 16), blockStride, hi<T>(v));
    }
    template <class T, class F>
    static void eachBlock(R<T> v, int first, F&& f) {
        H::template eachBlock<T>(lo<T>(v), first, f);
        H::template eachBlock<T>(hi<T>(v), first + kHalf / 16, f);
    }
    template <class T>
    static void store(T* p, R<T> v) {
        H::template store<T>(p, lo<T>(v));
        H::template store<T>(p + kHalfLanes<T>, hi<T>(v));
    }
    template <class T>
    static void storeAligned(T* p, R<T> v) { store<T>(p, v); }
    template <class T>
    static void storeHalf(T* p, R<T> v) { H::template store<T>(p, lo<T>(v)); }
    // Non-temporal, 16-byte alignment is enough.
    template <class T>
    static void stream(T* p, R<T> v) {
        H::template stream<T>(p, lo<T>(v));
        H::template stream<T>(p + kHalfLanes<T>, hi<T>(v));
    }
    static void prefetch(const void* p) { H::prefetch(p); }
    template <class W, class N>
    static R<W> loadWidened(const N* p) {
        using HV = Vec<W, kHalf>;
        return join<W>(simd::loadWidened<HV>(p).raw, simd::loadWidened<HV>(p + HV::kLanes).raw);
    }

    // -- lane by lane, and per 16-byte block
#  define ZOR_HALVES_1_(name)                                                                       \
    template <class T>                                                                               \
    static R<T> name(R<T> a) { return each<T, T>(a, [](auto x) { return H::template name<T>(x); }); }
#  define ZOR_HALVES_2_(name)                                                                      \
    template <class T>                                                                              \
    static R<T> name(R<T> a, R<T> b) {                                                              \
        return each<T, T>(a, b, [](auto x, auto y) { return H::template name<T>(x, y); });          \
    }
    template <class T>
    static R<T> allOnes() { return join<T>(H::template allOnes<T>(), H::template allOnes<T>()); }
    ZOR_HALVES_2_(bitAnd)
    ZOR_HALVES_2_(bitOr)
    ZOR_HALVES_2_(bitXor)
    ZOR_HALVES_2_(andNot)
    ZOR_HALVES_2_(add)
    ZOR_HALVES_2_(sub)
    ZOR_HALVES_2_(mul)
    ZOR_HALVES_2_(div)
    ZOR_HALVES_1_(sqrt)
    ZOR_HALVES_2_(eq)
    ZOR_HALVES_2_(gt)
    ZOR_HALVES_2_(ge)
    ZOR_HALVES_2_(min)
    ZOR_HALVES_2_(max)
    ZOR_HALVES_2_(addSat)
    ZOR_HALVES_2_(subSat)
    ZOR_HALVES_2_(avg)
    ZOR_HALVES_2_(mulHi)
    ZOR_HALVES_1_(abs)
    ZOR_HALVES_2_(zipLo)
    ZOR_HALVES_2_(zipHi)
    ZOR_HALVES_2_(concatEven)
    ZOR_HALVES_2_(concatOdd)
    ZOR_HALVES_2_(addPairs)
#  undef ZOR_HALVES_1_
#  undef ZOR_HALVES_2_
    template <class T>
    static R<T> select(R<T> mask, R<T> a, R<T> b) {
        return join<T>(H::template select<T>(lo<T>(mask), lo<T>(a), lo<T>(b)),
                       H::template select<T>(hi<T>(mask), hi<T>(a), hi<T>(b)));
    }
    template <class T, int N>
    static R<T> shl(R<T> a) { return each<T, T>(a, [](auto x) { return H::template shl<T, N>(x); }); }
    template <class T, int N>
    static R<T> shr(R<T> a) { return each<T, T>(a, [](auto x) { return H::template shr<T, N>(x); }); }
    template <class T>
    static R<T> shl(R<T> a, int n) { return each<T, T>(a, [n](auto x) { return H::template shl<T>(x, n); }); }
    template <class T>
    static R<T> shr(R<T> a, int n) { return each<T, T>(a, [n](auto x) { return H::template shr<T>(x, n); }); }
    template <class T>
    static R<Wider<T>> widenLo(R<T> a) {
        return each<Wider<T>, T>(a, [](auto x) { return H::template widenLo<T>(x); });
    }
    template <class T>
    static R<Wider<T>> widenHi(R<T> a) {
        return each<Wider<T>, T>(a, [](auto x) { return H::template widenHi<T>(x); });
    }
    template <class To, class From>
    static R<To> narrowSat(R<From> l, R<From> h) {
        return each<To, From>(l, h, [](auto x, auto y) { return H::template narrowSat<To, From>(x, y); });
    }
    template <class To, class From>
    static R<To> narrowTrunc(R<From> l, R<From> h) {
        return each<To, From>(l, h, [](auto x, auto y) { return H::template narrowTrunc<To, From>(x, y); });
    }
    static R<int32_t> mulAddPairs16(R<int16_t> a, R<int16_t> b) {
        return each<int32_t, int16_t>(a, b, [](auto x, auto y) { return H::mulAddPairs16(x, y); });
    }
    static R<uint64_t> sumAbsDiff8(R<uint8_t> a, R<uint8_t> b) {
        return each<uint64_t, uint8_t>(a, b, [](auto x, auto y) { return H::sumAbsDiff8(x, y); });
    }
    static R<int16_t> mulAddPairs8(R<uint8_t> u, R<int8_t> s) {
        return join<int16_t>(H::mulAddPairs8(lo<uint8_t>(u), lo<int8_t>(s)), H::mulAddPairs8(hi<uint8_t>(u), hi<int8_t>(s)));
    }
    static R<int16_t> mulHiRound(R<int16_t> a, R<int16_t> b) {
        return each<int16_t, int16_t>(a, b, [](auto x, auto y) { return H::mulHiRound(x, y); });
    }
    static R<uint8_t> shuffleBytes(R<uint8_t> t, R<uint8_t> idx) {
        return each<uint8_t, uint8_t>(t, idx, [](auto x, auto y) { return H::shuffleBytes(x, y); });
    }
    template <int N>
    static R<uint8_t> shiftBytesUp(R<uint8_t> a) {
        return each<uint8_t, uint8_t>(a, [](auto x) { return H::template shiftBytesUp<N>(x); });
    }
    template <int N>
    static R<uint8_t> shiftBytesDown(R<uint8_t> a) {
        return each<uint8_t, uint8_t>(a, [](auto x) { return H::template shiftBytesDown<N>(x); });
    }
    template <int N, class T>
    static R<T> alignBytes(R<T> h, R<T> l) {
        return each<T, T>(h, l, [](auto x, auto y) { return H::template alignBytes<N, T>(x, y); });
    }
    template <class T>
    static void transpose4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        auto a0 = lo<T>(a), b0 = lo<T>(b), c0 = lo<T>(c), d0 = lo<T>(d);
        auto a1 = hi<T>(a), b1 = hi<T>(b), c1 = hi<T>(c), d1 = hi<T>(d);
        H::template transpose4<T>(a0, b0, c0, d0);
        H::template transpose4<T>(a1, b1, c1, d1);
        a = join<T>(a0, a1), b = join<T>(b0, b1), c = join<T>(c0, c1), d = join<T>(d0, d1);
    }
    static R<float> recipApprox(R<float> a) { return each<float, float>(a, [](auto x) { return H::recipApprox(x); }); }
    template <class To, class From>
    static R<To> bitcast(R<From> a) {
        return each<To, From>(a, [](auto x) { return H::template bitcast<To, From>(x); });
    }

    // -- conversions (per 16-byte block where the lane count changes)
    static R<float> int32ToFloat(R<int32_t> a) { return each<float, int32_t>(a, [](auto x) { return H::int32ToFloat(x); }); }
    static R<int32_t> floatToInt32(R<float> a) { return each<int32_t, float>(a, [](auto x) { return H::floatToInt32(x); }); }
    static R<int32_t> floatToInt32Trunc(R<float> a) {
        return each<int32_t, float>(a, [](auto x) { return H::floatToInt32Trunc(x); });
    }
    static R<double> floatToDoubleLo(R<float> a) { return each<double, float>(a, [](auto x) { return H::floatToDoubleLo(x); }); }
    static R<double> floatToDoubleHi(R<float> a) { return each<double, float>(a, [](auto x) { return H::floatToDoubleHi(x); }); }
    static R<float> doubleToFloat(R<double> l, R<double> h) {
        return each<float, double>(l, h, [](auto x, auto y) { return H::doubleToFloat(x, y); });
    }
    static R<double> int32ToDoubleLo(R<int32_t> a) { return each<double, int32_t>(a, [](auto x) { return H::int32ToDoubleLo(x); }); }
    static R<double> int32ToDoubleHi(R<int32_t> a) { return each<double, int32_t>(a, [](auto x) { return H::int32ToDoubleHi(x); }); }
    static R<double> gatherDoubleLo(const double* t, R<int32_t> i) {
        return each<double, int32_t>(i, [t](auto x) { return H::gatherDoubleLo(t, x); });
    }
    static R<double> gatherDoubleHi(const double* t, R<int32_t> i) {
        return each<double, int32_t>(i, [t](auto x) { return H::gatherDoubleHi(t, x); });
    }
    // Lane by lane, the halves joined: on this AMD processor far faster than
    // the native gathers (vgatherdpd zmm: about 14 cycles per 8 doubles).
    static R<double> gatherDouble(const double* t, const int32_t* i) {
        return join<double>(H::gatherDouble(t, i), H::gatherDouble(t, i + kHalfLanes<double>));
    }
    static void gatherRowsLo(const double* t, const int32_t* i, R<double>& first, R<double>& second) {
        typename RawOf<double, kHalf>::type f0, s0, f1, s1;
        H::gatherRowsLo(t, i, f0, s0);
        H::gatherRowsLo(t, i + kHalfLanes<int32_t>, f1, s1);
        first = join<double>(f0, f1);
        second = join<double>(s0, s1);
    }
    static void gatherRowsHi(const double* t, const int32_t* i, R<double>& first, R<double>& second) {
        typename RawOf<double, kHalf>::type f0, s0, f1, s1;
        H::gatherRowsHi(t, i, f0, s0);
        H::gatherRowsHi(t, i + kHalfLanes<int32_t>, f1, s1);
        first = join<double>(f0, f1);
        second = join<double>(s0, s1);
    }
    static R<int32_t> doubleToInt32(R<double> l, R<double> h) {
        return each<int32_t, double>(l, h, [](auto x, auto y) { return H::doubleToInt32(x, y); });
    }
    static R<int32_t> doubleToInt32Trunc(R<double> l, R<double> h) {
        return each<int32_t, double>(l, h, [](auto x, auto y) { return H::doubleToInt32Trunc(x, y); });
    }
    static R<double> addPairs(R<double> a, R<double> b) {
        return each<double, double>(a, b, [](auto x, auto y) { return H::addPairs(x, y); });
    }

    // -- whole-register lane order
    static void loadInterleaved3(const uint8_t* p, R<uint8_t>& a, R<uint8_t>& b, R<uint8_t>& c) {
        typename RawOf<uint8_t, kHalf>::type a0, b0, c0, a1, b1, c1;
        H::loadInterleaved3(p, a0, b0, c0);
        H::loadInterleaved3(p + 3 * kHalf, a1, b1, c1);
        a = join<uint8_t>(a0, a1), b = join<uint8_t>(b0, b1), c = join<uint8_t>(c0, c1);
    }
    static void storeInterleaved3(uint8_t* p, R<uint8_t> a, R<uint8_t> b, R<uint8_t> c) {
        H::storeInterleaved3(p, lo<uint8_t>(a), lo<uint8_t>(b), lo<uint8_t>(c));
        H::storeInterleaved3(p + 3 * kHalf, hi<uint8_t>(a), hi<uint8_t>(b), hi<uint8_t>(c));
    }
    static void deinterleave(R<float> a, R<float> b, R<float>& even, R<float>& odd) {
        typename RawOf<float, kHalf>::type e0, o0, e1, o1;
        H::deinterleave(lo<float>(a), hi<float>(a), e0, o0);
        H::deinterleave(lo<float>(b), hi<float>(b), e1, o1);
        even = join<float>(e0, e1), odd = join<float>(o0, o1);
    }
    static void interleave(R<float> even, R<float> odd, R<float>& l, R<float>& h) {
        typename RawOf<float, kHalf>::type l0, h0, l1, h1;
        H::interleave(lo<float>(even), lo<float>(odd), l0, h0);
        H::interleave(hi<float>(even), hi<float>(odd), l1, h1);
        l = join<float>(l0, h0), h = join<float>(l1, h1);
    }
    static void transpose(R<float> (&r)[Bytes / 4]) {
        constexpr int n = Bytes / 4;
        alignas(64) float m[n][n];
        for (int i = 0; i < n; ++i) store<float>(m[i], r[i]);
        for (int i = 0; i < n; ++i)
            for (int j = i + 1; j < n; ++j) std::swap(m[i][j], m[j][i]);
        for (int i = 0; i < n; ++i) r[i] = load<float>(m[i]);
    }
    template <class T>
    static R<T> reverseLanes(R<T> a) {
        return join<T>(H::template reverseLanes<T>(hi<T>(a)), H::template reverseLanes<T>(lo<T>(a)));
    }
    template <class T>
    static int laneMask(R<T> a) {
        static_assert(Bytes / sizeof(T) <= 32, "a lane mask of at most 32 lanes");
        return int(unsigned(H::template laneMask<T>(lo<T>(a))) |
                   (unsigned(H::template laneMask<T>(hi<T>(a))) << kHalfLanes<T>));
    }
    static int byteMask(R<uint8_t> a) {
        static_assert(Bytes <= 32, "a byte mask of at most 32 bytes");
        return int(unsigned(H::byteMask(lo<uint8_t>(a))) | (unsigned(H::byteMask(hi<uint8_t>(a))) << kHalf));
    }
    template <class T>
    static bool anyTrue(R<T> m) { return H::template anyTrue<T>(lo<T>(m)) || H::template anyTrue<T>(hi<T>(m)); }
    template <class T>
    static bool allTrue(R<T> m) { return H::template allTrue<T>(lo<T>(m)) && H::template allTrue<T>(hi<T>(m)); }
    template <class T>
    static int firstTrue(R<T> m) {
        const int f = H::template firstTrue<T>(lo<T>(m));
        return f < kHalfLanes<T> ? f : kHalfLanes<T> + H::template firstTrue<T>(hi<T>(m));
    }
    template <int I, class T>
    static T getLane(R<T> a) {
        if constexpr (I < kHalfLanes<T>) return H::template getLane<I, T>(lo<T>(a));
        else return H::template getLane<I - kHalfLanes<T>, T>(hi<T>(a));
    }
    // Lane i + n/2 added to lane i (the left operand), then the same on the
    // half: the order of the 16-byte reduction, continued.
    template <class T>
    static T reduceAdd(R<T> a) { return H::template reduceAdd<T>(H::template add<T>(lo<T>(a), hi<T>(a))); }
};

// The 32-byte registers.  Float and double lanes keep the order of their
// 16-byte halves: the conversions between them work per 16-byte block, so a
// permutation of 8-byte chunks ((0, 2, 1, 3): lanes 0, 1 of each block
// together) goes before a widening and after a narrowing.
template <>
struct Isa<32> : Halves<32> {
    using Base = Halves<32>;
    template <class T>
    static constexpr bool isF = std::is_same_v<T, float>;
    template <class T>
    static constexpr bool isD = std::is_same_v<T, double>;
    template <class T>
    static constexpr bool isInt = std::is_integral_v<T>;

    // Per 16-byte block, as the instructions work: one instruction per step.
    template <class T>
    static void transpose4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        static_assert(sizeof(T) == 4, "transpose4 of 32-bit lanes");
        if constexpr (isF<T>) {
            const __m256 t0 = _mm256_unpacklo_ps(a, b), t1 = _mm256_unpackhi_ps(a, b);
            const __m256 t2 = _mm256_unpacklo_ps(c, d), t3 = _mm256_unpackhi_ps(c, d);
            a = _mm256_shuffle_ps(t0, t2, 0x44), b = _mm256_shuffle_ps(t0, t2, 0xEE);
            c = _mm256_shuffle_ps(t1, t3, 0x44), d = _mm256_shuffle_ps(t1, t3, 0xEE);
        } else {
            const __m256i t0 = _mm256_unpacklo_epi32(a, b), t1 = _mm256_unpackhi_epi32(a, b);
            const __m256i t2 = _mm256_unpacklo_epi32(c, d), t3 = _mm256_unpackhi_epi32(c, d);
            a = _mm256_unpacklo_epi64(t0, t2), b = _mm256_unpackhi_epi64(t0, t2);
            c = _mm256_unpacklo_epi64(t1, t3), d = _mm256_unpackhi_epi64(t1, t3);
        }
    }
    // The 16-byte blocks of a, b and of c, d as 2 x 2 squares, transposed.
    template <class T>
    static void transposeBlocks4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        const auto swap = [](R<T>& x, R<T>& y) {
            if constexpr (isF<T>) {
                const __m256 l = _mm256_permute2f128_ps(x, y, 0x20), h = _mm256_permute2f128_ps(x, y, 0x31);
                x = l, y = h;
            } else if constexpr (isD<T>) {
                const __m256d l = _mm256_permute2f128_pd(x, y, 0x20), h = _mm256_permute2f128_pd(x, y, 0x31);
                x = l, y = h;
            } else {
                const __m256i l = _mm256_permute2x128_si256(x, y, 0x20), h = _mm256_permute2x128_si256(x, y, 0x31);
                x = l, y = h;
            }
        };
        swap(a, b);
        swap(c, d);
    }
    // Lane order over the whole register: the even and odd lanes of the run
    // a, b.
    static void deinterleave(__m256 a, __m256 b, __m256& even, __m256& odd) {
        const __m256d e = _mm256_castps_pd(_mm256_shuffle_ps(a, b, 0x88));
        const __m256d o = _mm256_castps_pd(_mm256_shuffle_ps(a, b, 0xDD));
        even = _mm256_castpd_ps(_mm256_permute4x64_pd(e, 0xD8));
        odd = _mm256_castpd_ps(_mm256_permute4x64_pd(o, 0xD8));
    }

    template <class T>
    static R<T> zero() {
        if constexpr (isF<T>) return _mm256_setzero_ps();
        else if constexpr (isD<T>) return _mm256_setzero_pd();
        else return _mm256_setzero_si256();
    }
    template <class T>
    static R<T> set1(T x) {
        if constexpr (isF<T>) return _mm256_set1_ps(x);
        else if constexpr (isD<T>) return _mm256_set1_pd(x);
        else if constexpr (sizeof(T) == 1) return _mm256_set1_epi8(static_cast<char>(x));
        else if constexpr (sizeof(T) == 2) return _mm256_set1_epi16(static_cast<short>(x));
        else if constexpr (sizeof(T) == 4) return _mm256_set1_epi32(static_cast<int>(x));
        else return _mm256_set1_epi64x(static_cast<long long>(x));
    }
    template <class T>
    static R<T> load(const T* p) {
        if constexpr (isF<T>) return _mm256_loadu_ps(p);
        else if constexpr (isD<T>) return _mm256_loadu_pd(p);
        else return _mm256_loadu_si256(reinterpret_cast<const __m256i*>(p));
    }
    template <class T>
    static R<T> loadAligned(const T* p) { return load<T>(p); }
    template <class T>
    static void store(T* p, R<T> v) {
        if constexpr (isF<T>) _mm256_storeu_ps(p, v);
        else if constexpr (isD<T>) _mm256_storeu_pd(p, v);
        else _mm256_storeu_si256(reinterpret_cast<__m256i*>(p), v);
    }
    template <class T>
    static void storeAligned(T* p, R<T> v) { store<T>(p, v); }

    template <class T>
    static R<T> bitAnd(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_and_ps(a, b);
        else if constexpr (isD<T>) return _mm256_and_pd(a, b);
        else return _mm256_and_si256(a, b);
    }
    template <class T>
    static R<T> bitOr(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_or_ps(a, b);
        else if constexpr (isD<T>) return _mm256_or_pd(a, b);
        else return _mm256_or_si256(a, b);
    }
    template <class T>
    static R<T> bitXor(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_xor_ps(a, b);
        else if constexpr (isD<T>) return _mm256_xor_pd(a, b);
        else return _mm256_xor_si256(a, b);
    }
    template <class T>
    static R<T> andNot(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_andnot_ps(a, b);
        else if constexpr (isD<T>) return _mm256_andnot_pd(a, b);
        else return _mm256_andnot_si256(a, b);
    }
    template <class T>
    static R<T> select(R<T> mask, R<T> a, R<T> b) { return bitOr<T>(bitAnd<T>(mask, a), andNot<T>(mask, b)); }

    template <class T>
    static R<T> add(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_add_ps(a, b);
        else if constexpr (isD<T>) return _mm256_add_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm256_add_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm256_add_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm256_add_epi32(a, b);
        else return _mm256_add_epi64(a, b);
    }
    template <class T>
    static R<T> sub(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_sub_ps(a, b);
        else if constexpr (isD<T>) return _mm256_sub_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm256_sub_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm256_sub_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm256_sub_epi32(a, b);
        else return _mm256_sub_epi64(a, b);
    }
    template <class T>
    static R<T> mul(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_mul_ps(a, b);
        else if constexpr (isD<T>) return _mm256_mul_pd(a, b);
        else if constexpr (sizeof(T) == 2) return _mm256_mullo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm256_mullo_epi32(a, b);
        else return Base::mul<T>(a, b);
    }
    template <class T>
    static R<T> div(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_div_ps(a, b);
        else return _mm256_div_pd(a, b);
    }
    template <class T>
    static R<T> sqrt(R<T> a) {
        if constexpr (isF<T>) return _mm256_sqrt_ps(a);
        else return _mm256_sqrt_pd(a);
    }
    // The predicates of cmpeqps, cmpltps and cmpleps (operands swapped for
    // gt, ge): the same results and flags as the 16-byte compares.
    template <class T>
    static R<T> eq(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_cmp_ps(a, b, _CMP_EQ_OQ);
        else if constexpr (isD<T>) return _mm256_cmp_pd(a, b, _CMP_EQ_OQ);
        else return Base::eq<T>(a, b);
    }
    template <class T>
    static R<T> gt(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_cmp_ps(b, a, _CMP_LT_OS);
        else if constexpr (isD<T>) return _mm256_cmp_pd(b, a, _CMP_LT_OS);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm256_cmpgt_epi8(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_cmpgt_epi16(a, b);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_cmpgt_epi32(a, b);
        else return Base::gt<T>(a, b);
    }
    template <class T>
    static R<T> ge(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_cmp_ps(b, a, _CMP_LE_OS);
        else if constexpr (isD<T>) return _mm256_cmp_pd(b, a, _CMP_LE_OS);
        else return Base::ge<T>(a, b);
    }
    template <class T>
    static R<T> min(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_min_ps(a, b);
        else if constexpr (isD<T>) return _mm256_min_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm256_min_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm256_min_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm256_min_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_min_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm256_min_epu32(a, b);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_min_epi32(a, b);
        else return Base::min<T>(a, b);
    }
    template <class T>
    static R<T> max(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm256_max_ps(a, b);
        else if constexpr (isD<T>) return _mm256_max_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm256_max_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm256_max_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm256_max_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_max_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm256_max_epu32(a, b);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_max_epi32(a, b);
        else return Base::max<T>(a, b);
    }

    // -- integer lanes per 16-byte block, one instruction where the
    // 16-byte registers take one
    template <class T>
    static R<T> loadBlocks(const T* p, ptrdiff_t blockStride) {
        if constexpr (!isInt<T>) return Base::loadBlocks<T>(p, blockStride);
        else if (blockStride == 0) return _mm256_broadcastsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(p)));
        else return Base::loadBlocks<T>(p, blockStride);
    }
    static __m256i shuffleBytes(__m256i t, __m256i idx) { return _mm256_shuffle_epi8(t, idx); }
    static __m256i mulAddPairs16(__m256i a, __m256i b) { return _mm256_madd_epi16(a, b); }
    static __m256i mulAddPairs8(__m256i u, __m256i s) { return _mm256_maddubs_epi16(u, s); }
    template <int N>
    static __m256i shiftBytesUp(__m256i a) { return _mm256_bslli_epi128(a, N); }
    template <int N>
    static __m256i shiftBytesDown(__m256i a) { return _mm256_bsrli_epi128(a, N); }
    template <class T>
    static R<T> zipLo(R<T> a, R<T> b) {
        if constexpr (!isInt<T>) return Base::zipLo<T>(a, b);
        else if constexpr (sizeof(T) == 1) return _mm256_unpacklo_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm256_unpacklo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm256_unpacklo_epi32(a, b);
        else return _mm256_unpacklo_epi64(a, b);
    }
    template <class T>
    static R<T> zipHi(R<T> a, R<T> b) {
        if constexpr (!isInt<T>) return Base::zipHi<T>(a, b);
        else if constexpr (sizeof(T) == 1) return _mm256_unpackhi_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm256_unpackhi_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm256_unpackhi_epi32(a, b);
        else return _mm256_unpackhi_epi64(a, b);
    }
    // The lanes' upper halves when widened: zero, or copies of the sign.
    template <class T>
    static __m256i extension(__m256i a) {
        if constexpr (std::is_unsigned_v<T>) return _mm256_setzero_si256();
        else if constexpr (sizeof(T) == 1) return _mm256_cmpgt_epi8(_mm256_setzero_si256(), a);
        else if constexpr (sizeof(T) == 2) return _mm256_srai_epi16(a, 15);
        else return _mm256_srai_epi32(a, 31);
    }
    template <class T>
    static R<Wider<T>> widenLo(R<T> a) {
        if constexpr (isInt<T> && sizeof(T) <= 4) return zipLo<T>(a, extension<T>(a));
        else return Base::widenLo<T>(a);
    }
    template <class T>
    static R<Wider<T>> widenHi(R<T> a) {
        if constexpr (isInt<T> && sizeof(T) <= 4) return zipHi<T>(a, extension<T>(a));
        else return Base::widenHi<T>(a);
    }
    template <class To, class From>
    static R<To> narrowSat(R<From> lo, R<From> hi) {
        if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, uint8_t>) return _mm256_packus_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, int8_t>) return _mm256_packs_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, int32_t> && std::is_same_v<To, int16_t>) return _mm256_packs_epi32(lo, hi);
        else return Base::narrowSat<To, From>(lo, hi);
    }
    using Base::addPairs;
    template <class T>
    static R<T> addPairs(R<T> a, R<T> b) {
        if constexpr (std::is_same_v<T, int32_t> || std::is_same_v<T, uint32_t>) return _mm256_hadd_epi32(a, b);
        else return Base::addPairs<T>(a, b);
    }

    // Three interleaved byte channels, 96 bytes: each 16-byte lane does the
    // work of the 16-byte registers on its own 48 bytes (the first 16
    // pixels in the lower lane, the next 16 in the upper one).
    static __m256i loadLanes(const uint8_t* lo, const uint8_t* hi) {
        return _mm256_inserti128_si256(_mm256_castsi128_si256(_mm_loadu_si128(reinterpret_cast<const __m128i*>(lo))),
                                       _mm_loadu_si128(reinterpret_cast<const __m128i*>(hi)), 1);
    }
    static __m256i perLane(const uint8_t* m) {
        return _mm256_broadcastsi128_si256(_mm_load_si128(reinterpret_cast<const __m128i*>(m)));
    }
    static void loadInterleaved3(const uint8_t* p, __m256i& a, __m256i& b, __m256i& c) {
        alignas(16) static constexpr auto masks = interleaveMasks(false);
        const __m256i v[3] = {loadLanes(p, p + 48), loadLanes(p + 16, p + 64), loadLanes(p + 32, p + 80)};
        __m256i out[3];
        for (int k = 0; k < 3; ++k)
            out[k] = _mm256_or_si256(_mm256_or_si256(_mm256_shuffle_epi8(v[0], perLane(masks.m[3 * k])),
                                                     _mm256_shuffle_epi8(v[1], perLane(masks.m[3 * k + 1]))),
                                     _mm256_shuffle_epi8(v[2], perLane(masks.m[3 * k + 2])));
        a = out[0], b = out[1], c = out[2];
    }
    static void storeInterleaved3(uint8_t* p, __m256i a, __m256i b, __m256i c) {
        alignas(16) static constexpr auto masks = interleaveMasks(true);
        const __m256i in[3] = {a, b, c};
        for (int r = 0; r < 3; ++r) {
            const __m256i o = _mm256_or_si256(_mm256_or_si256(_mm256_shuffle_epi8(in[0], perLane(masks.m[3 * r])),
                                                              _mm256_shuffle_epi8(in[1], perLane(masks.m[3 * r + 1]))),
                                              _mm256_shuffle_epi8(in[2], perLane(masks.m[3 * r + 2])));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(p + 16 * r), _mm256_castsi256_si128(o));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(p + 48 + 16 * r), _mm256_extracti128_si256(o, 1));
        }
    }

    static __m256d blockPairsTogether(__m256d a) { return _mm256_permute4x64_pd(a, _MM_SHUFFLE(3, 1, 2, 0)); }
    static __m256i blockPairsTogether(__m256i a) { return _mm256_permute4x64_epi64(a, _MM_SHUFFLE(3, 1, 2, 0)); }
    static __m256d int32ToDoubleLo(__m256i a) { return _mm256_cvtepi32_pd(_mm256_castsi256_si128(blockPairsTogether(a))); }
    static __m256d int32ToDoubleHi(__m256i a) { return _mm256_cvtepi32_pd(_mm256_extracti128_si256(blockPairsTogether(a), 1)); }
    static __m256d gatherDoubleLo(const double* t, __m256i i) {
        return _mm256_i32gather_pd(t, _mm256_castsi256_si128(blockPairsTogether(i)), 8);
    }
    static __m256d gatherDoubleHi(const double* t, __m256i i) {
        return _mm256_i32gather_pd(t, _mm256_extracti128_si256(blockPairsTogether(i), 1), 8);
    }
    // Rows from general-register addresses, one 16-byte load each: faster
    // than two gathers of their halves.
    static __m256d rowsOf(const double* t, int32_t a, int32_t b) {
        return _mm256_insertf128_pd(_mm256_castpd128_pd256(_mm_loadu_pd(t + uint32_t(a))), _mm_loadu_pd(t + uint32_t(b)), 1);
    }
    static void gatherRowsLo(const double* t, const int32_t* i, __m256d& first, __m256d& second) {
        const __m256d a = rowsOf(t, i[0], i[4]), b = rowsOf(t, i[1], i[5]);
        first = _mm256_unpacklo_pd(a, b);
        second = _mm256_unpackhi_pd(a, b);
    }
    static void gatherRowsHi(const double* t, const int32_t* i, __m256d& first, __m256d& second) {
        gatherRowsLo(t, i + 2, first, second);
    }

    // Reinterpretations: no instruction.
    template <class To, class From>
    static R<To> bitcast(R<From> a) {
        if constexpr (isF<To> == isF<From> && isD<To> == isD<From>) return a;  // the same register type
        else if constexpr (isF<To>) {
            if constexpr (isD<From>) return _mm256_castpd_ps(a);
            else return _mm256_castsi256_ps(a);
        } else if constexpr (isD<To>) {
            if constexpr (isF<From>) return _mm256_castps_pd(a);
            else return _mm256_castsi256_pd(a);
        } else {
            if constexpr (isF<From>) return _mm256_castps_si256(a);
            else return _mm256_castpd_si256(a);
        }
    }
    // Shifts by a run-time count, one instruction.
    template <class T>
    static R<T> shl(R<T> a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (sizeof(T) == 2) return _mm256_sll_epi16(a, c);
        else if constexpr (sizeof(T) == 4) return _mm256_sll_epi32(a, c);
        else if constexpr (sizeof(T) == 8) return _mm256_sll_epi64(a, c);
        else return Base::shl<T>(a, n);
    }
    template <class T>
    static R<T> shr(R<T> a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (std::is_same_v<T, uint16_t>) return _mm256_srl_epi16(a, c);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_sra_epi16(a, c);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm256_srl_epi32(a, c);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_sra_epi32(a, c);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm256_srl_epi64(a, c);
        else return Base::shr<T>(a, n);
    }
    template <class T, int N>
    static R<T> shl(R<T> a) {
        if constexpr (sizeof(T) == 2) return _mm256_slli_epi16(a, N);
        else if constexpr (sizeof(T) == 4) return _mm256_slli_epi32(a, N);
        else if constexpr (sizeof(T) == 8) return _mm256_slli_epi64(a, N);
        else return Base::shl<T, N>(a);
    }
    template <class T, int N>
    static R<T> shr(R<T> a) {
        if constexpr (std::is_same_v<T, uint16_t>) return _mm256_srli_epi16(a, N);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_srai_epi16(a, N);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm256_srli_epi32(a, N);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_srai_epi32(a, N);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm256_srli_epi64(a, N);
        else return Base::shr<T, N>(a);
    }
    template <class T>
    static R<T> concatEven(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatEven of 32-bit lanes");
        if constexpr (isF<T>) return _mm256_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0));
        else return _mm256_castps_si256(_mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
    }
    template <class T>
    static R<T> concatOdd(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatOdd of 32-bit lanes");
        if constexpr (isF<T>) return _mm256_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1));
        else return _mm256_castps_si256(_mm256_shuffle_ps(_mm256_castsi256_ps(a), _mm256_castsi256_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
    }
    static __m256 recipApprox(__m256 a) { return _mm256_rcp_ps(a); }  // the same estimate as rcpps on each half
    template <class T>
    static int maskBits(R<T> m) {
        if constexpr (isF<T>) return _mm256_movemask_ps(m);
        else if constexpr (isD<T>) return _mm256_movemask_pd(m);
        else return _mm256_movemask_epi8(m);
    }
    template <class T>
    static bool anyTrue(R<T> m) { return maskBits<T>(m) != 0; }
    template <class T>
    static bool allTrue(R<T> m) { return maskBits<T>(m) == (isF<T> ? 0xFF : isD<T> ? 0xF : -1); }
    static __m256 int32ToFloat(__m256i a) { return _mm256_cvtepi32_ps(a); }
    static __m256i floatToInt32(__m256 a) { return _mm256_cvtps_epi32(a); }
    static __m256i floatToInt32Trunc(__m256 a) { return _mm256_cvttps_epi32(a); }
    static __m256d floatToDoubleLo(__m256 a) {
        return _mm256_cvtps_pd(_mm256_castps256_ps128(_mm256_castpd_ps(blockPairsTogether(_mm256_castps_pd(a)))));
    }
    static __m256d floatToDoubleHi(__m256 a) {
        return _mm256_cvtps_pd(_mm256_extractf128_ps(_mm256_castpd_ps(blockPairsTogether(_mm256_castps_pd(a))), 1));
    }
    static __m256 doubleToFloat(__m256d lo, __m256d hi) {
        return _mm256_castpd_ps(blockPairsTogether(_mm256_castps_pd(doubleToFloatInOrder(lo, hi))));
    }
    static __m256 doubleToFloatInOrder(__m256d lo, __m256d hi) {
        return _mm256_insertf128_ps(_mm256_castps128_ps256(_mm256_cvtpd_ps(lo)), _mm256_cvtpd_ps(hi), 1);
    }

    // -- whole-register lane order: vpmovsx / vpmovzx, and packs whose
    // 64-bit chunks are put back in order
    template <class T, class Half>
    static R<Wider<T>> widenHalf(Half h) {
        if constexpr (isF<T>) return _mm256_cvtps_pd(h);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm256_cvtepi8_epi16(h);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm256_cvtepu8_epi16(h);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm256_cvtepi16_epi32(h);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm256_cvtepu16_epi32(h);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm256_cvtepi32_epi64(h);
        else return _mm256_cvtepu32_epi64(h);
    }
    template <class T>
    static R<Wider<T>> widenLoInOrder(R<T> a) { return widenHalf<T>(lo<T>(a)); }
    template <class T>
    static R<Wider<T>> widenHiInOrder(R<T> a) { return widenHalf<T>(hi<T>(a)); }
    template <class W, class N>
    static R<W> loadWidened(const N* p) {
        return widenHalf<N>(H::template load<N>(p));
    }
    template <class To, class From>
    static constexpr bool kPacksInOrder =
        std::is_same_v<From, int32_t> ? (std::is_same_v<To, int16_t> || std::is_same_v<To, uint16_t>)
                                      : std::is_same_v<From, int16_t> && (std::is_same_v<To, int8_t> || std::is_same_v<To, uint8_t>);
    template <class To, class From>
    static R<To> narrowSatInOrder(R<From> l, R<From> h) {
        if constexpr (isD<From>) {
            return join<float>(_mm256_cvtpd_ps(l), _mm256_cvtpd_ps(h));
        } else if constexpr (kPacksInOrder<To, From>) {
            __m256i packed;
            if constexpr (std::is_same_v<To, int16_t>) packed = _mm256_packs_epi32(l, h);
            else if constexpr (std::is_same_v<To, uint16_t>) packed = _mm256_packus_epi32(l, h);
            else if constexpr (std::is_same_v<To, int8_t>) packed = _mm256_packs_epi16(l, h);
            else packed = _mm256_packus_epi16(l, h);
            return _mm256_permute4x64_epi64(packed, _MM_SHUFFLE(3, 1, 2, 0));
        } else {
            return join<To>(H::template narrowSat<To, From>(lo<From>(l), hi<From>(l)),
                            H::template narrowSat<To, From>(lo<From>(h), hi<From>(h)));
        }
    }
};

#  if ZOR_WIDTH >= 64
// The 64-byte registers: comparisons give opmasks, spread back into lanes.
template <>
struct Isa<64> : Halves<64> {
    using Base = Halves<64>;
    template <class T>
    static constexpr bool isF = std::is_same_v<T, float>;
    template <class T>
    static constexpr bool isD = std::is_same_v<T, double>;
    template <class T>
    static constexpr bool isInt = std::is_integral_v<T>;

    // Per 16-byte block, as the instructions work: one instruction per step.
    template <class T>
    static void transpose4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        static_assert(sizeof(T) == 4, "transpose4 of 32-bit lanes");
        if constexpr (isF<T>) {
            const __m512 t0 = _mm512_unpacklo_ps(a, b), t1 = _mm512_unpackhi_ps(a, b);
            const __m512 t2 = _mm512_unpacklo_ps(c, d), t3 = _mm512_unpackhi_ps(c, d);
            a = _mm512_shuffle_ps(t0, t2, 0x44), b = _mm512_shuffle_ps(t0, t2, 0xEE);
            c = _mm512_shuffle_ps(t1, t3, 0x44), d = _mm512_shuffle_ps(t1, t3, 0xEE);
        } else {
            const __m512i t0 = _mm512_unpacklo_epi32(a, b), t1 = _mm512_unpackhi_epi32(a, b);
            const __m512i t2 = _mm512_unpacklo_epi32(c, d), t3 = _mm512_unpackhi_epi32(c, d);
            a = _mm512_unpacklo_epi64(t0, t2), b = _mm512_unpackhi_epi64(t0, t2);
            c = _mm512_unpacklo_epi64(t1, t3), d = _mm512_unpackhi_epi64(t1, t3);
        }
    }
    // The 16-byte blocks of a, b, c, d as a 4 x 4 square, transposed.
    template <class T>
    static void transposeBlocks4(R<T>& a, R<T>& b, R<T>& c, R<T>& d) {
        const auto pick = [](R<T> x, R<T> y, auto imm) -> R<T> {
            constexpr int k = decltype(imm)::value;
            if constexpr (isF<T>) return _mm512_shuffle_f32x4(x, y, k);
            else if constexpr (isD<T>) return _mm512_shuffle_f64x2(x, y, k);
            else return _mm512_shuffle_i32x4(x, y, k);
        };
        using Lo = std::integral_constant<int, 0x44>;  // x0 x1 y0 y1
        using Hi = std::integral_constant<int, 0xEE>;  // x2 x3 y2 y3
        using Even = std::integral_constant<int, 0x88>;  // x0 x2 y0 y2
        using Odd = std::integral_constant<int, 0xDD>;  // x1 x3 y1 y3
        const R<T> t0 = pick(a, b, Lo{}), t1 = pick(a, b, Hi{}), t2 = pick(c, d, Lo{}), t3 = pick(c, d, Hi{});
        a = pick(t0, t2, Even{}), b = pick(t0, t2, Odd{}), c = pick(t1, t3, Even{}), d = pick(t1, t3, Odd{});
    }
    // Lane order over the whole register: the even and odd lanes of the run
    // a, b.
    static void deinterleave(__m512 a, __m512 b, __m512& even, __m512& odd) {
        const __m512i e = _mm512_setr_epi32(0, 2, 4, 6, 8, 10, 12, 14, 16, 18, 20, 22, 24, 26, 28, 30);
        even = _mm512_permutex2var_ps(a, e, b);
        odd = _mm512_permutex2var_ps(a, _mm512_add_epi32(e, _mm512_set1_epi32(1)), b);
    }

    template <class T>
    static R<T> zero() {
        if constexpr (isF<T>) return _mm512_setzero_ps();
        else if constexpr (isD<T>) return _mm512_setzero_pd();
        else return _mm512_setzero_si512();
    }
    template <class T>
    static R<T> set1(T x) {
        if constexpr (isF<T>) return _mm512_set1_ps(x);
        else if constexpr (isD<T>) return _mm512_set1_pd(x);
        else if constexpr (sizeof(T) == 1) return _mm512_set1_epi8(static_cast<char>(x));
        else if constexpr (sizeof(T) == 2) return _mm512_set1_epi16(static_cast<short>(x));
        else if constexpr (sizeof(T) == 4) return _mm512_set1_epi32(static_cast<int>(x));
        else return _mm512_set1_epi64(static_cast<long long>(x));
    }
    template <class T>
    static R<T> load(const T* p) {
        if constexpr (isF<T>) return _mm512_loadu_ps(p);
        else if constexpr (isD<T>) return _mm512_loadu_pd(p);
        else return _mm512_loadu_si512(p);
    }
    template <class T>
    static R<T> loadAligned(const T* p) { return load<T>(p); }
    template <class T>
    static void store(T* p, R<T> v) {
        if constexpr (isF<T>) _mm512_storeu_ps(p, v);
        else if constexpr (isD<T>) _mm512_storeu_pd(p, v);
        else _mm512_storeu_si512(p, v);
    }
    template <class T>
    static void storeAligned(T* p, R<T> v) { store<T>(p, v); }

    template <class T>
    static R<T> bitAnd(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_and_ps(a, b);
        else if constexpr (isD<T>) return _mm512_and_pd(a, b);
        else return _mm512_and_si512(a, b);
    }
    template <class T>
    static R<T> bitOr(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_or_ps(a, b);
        else if constexpr (isD<T>) return _mm512_or_pd(a, b);
        else return _mm512_or_si512(a, b);
    }
    template <class T>
    static R<T> bitXor(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_xor_ps(a, b);
        else if constexpr (isD<T>) return _mm512_xor_pd(a, b);
        else return _mm512_xor_si512(a, b);
    }
    template <class T>
    static R<T> andNot(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_andnot_ps(a, b);
        else if constexpr (isD<T>) return _mm512_andnot_pd(a, b);
        else return _mm512_andnot_si512(a, b);
    }
    template <class T>
    static R<T> select(R<T> mask, R<T> a, R<T> b) { return bitOr<T>(bitAnd<T>(mask, a), andNot<T>(mask, b)); }

    template <class T>
    static R<T> add(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_add_ps(a, b);
        else if constexpr (isD<T>) return _mm512_add_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm512_add_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm512_add_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm512_add_epi32(a, b);
        else return _mm512_add_epi64(a, b);
    }
    template <class T>
    static R<T> sub(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_sub_ps(a, b);
        else if constexpr (isD<T>) return _mm512_sub_pd(a, b);
        else if constexpr (sizeof(T) == 1) return _mm512_sub_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm512_sub_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm512_sub_epi32(a, b);
        else return _mm512_sub_epi64(a, b);
    }
    template <class T>
    static R<T> mul(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_mul_ps(a, b);
        else if constexpr (isD<T>) return _mm512_mul_pd(a, b);
        else if constexpr (sizeof(T) == 2) return _mm512_mullo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm512_mullo_epi32(a, b);
        else return Base::mul<T>(a, b);
    }
    template <class T>
    static R<T> div(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_div_ps(a, b);
        else return _mm512_div_pd(a, b);
    }
    template <class T>
    static R<T> sqrt(R<T> a) {
        if constexpr (isF<T>) return _mm512_sqrt_ps(a);
        else return _mm512_sqrt_pd(a);
    }
    template <class T>
    static R<T> eq(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_castsi512_ps(_mm512_movm_epi32(_mm512_cmp_ps_mask(a, b, _CMP_EQ_OQ)));
        else if constexpr (isD<T>) return _mm512_castsi512_pd(_mm512_movm_epi64(_mm512_cmp_pd_mask(a, b, _CMP_EQ_OQ)));
        else return Base::eq<T>(a, b);
    }
    template <class T>
    static R<T> gt(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_castsi512_ps(_mm512_movm_epi32(_mm512_cmp_ps_mask(b, a, _CMP_LT_OS)));
        else if constexpr (isD<T>) return _mm512_castsi512_pd(_mm512_movm_epi64(_mm512_cmp_pd_mask(b, a, _CMP_LT_OS)));
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_movm_epi32(_mm512_cmpgt_epi32_mask(a, b));
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm512_movm_epi32(_mm512_cmpgt_epu32_mask(a, b));
        else return Base::gt<T>(a, b);
    }
    template <class T>
    static R<T> ge(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_castsi512_ps(_mm512_movm_epi32(_mm512_cmp_ps_mask(b, a, _CMP_LE_OS)));
        else if constexpr (isD<T>) return _mm512_castsi512_pd(_mm512_movm_epi64(_mm512_cmp_pd_mask(b, a, _CMP_LE_OS)));
        else return Base::ge<T>(a, b);
    }
    template <class T>
    static R<T> min(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_min_ps(a, b);
        else if constexpr (isD<T>) return _mm512_min_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm512_min_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm512_min_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm512_min_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm512_min_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm512_min_epu32(a, b);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_min_epi32(a, b);
        else return Base::min<T>(a, b);
    }
    template <class T>
    static R<T> max(R<T> a, R<T> b) {
        if constexpr (isF<T>) return _mm512_max_ps(a, b);
        else if constexpr (isD<T>) return _mm512_max_pd(a, b);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm512_max_epu8(a, b);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm512_max_epi8(a, b);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm512_max_epu16(a, b);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm512_max_epi16(a, b);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm512_max_epu32(a, b);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_max_epi32(a, b);
        else return Base::max<T>(a, b);
    }

    // -- integer lanes per 16-byte block, one instruction where the
    // 16-byte registers take one
    template <class T>
    static R<T> loadBlocks(const T* p, ptrdiff_t blockStride) {
        if constexpr (!isInt<T>) {
            return Base::loadBlocks<T>(p, blockStride);
        } else {
            const auto block = [&](int b) {
                return _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + blockStride * b));
            };
            if (blockStride == 0) return _mm512_broadcast_i32x4(block(0));
            __m512i v = _mm512_castsi128_si512(block(0));
            v = _mm512_inserti32x4(v, block(1), 1);
            v = _mm512_inserti32x4(v, block(2), 2);
            return _mm512_inserti32x4(v, block(3), 3);
        }
    }
    template <class T>
    static void storeBlocks(T* p, ptrdiff_t blockStride, R<T> v) {
        if constexpr (!isInt<T>) {
            Base::storeBlocks<T>(p, blockStride, v);
        } else {
            const auto at = [&](int b) { return reinterpret_cast<__m128i*>(p + blockStride * b); };
            _mm_storeu_si128(at(0), _mm512_castsi512_si128(v));
            _mm_storeu_si128(at(1), _mm512_extracti32x4_epi32(v, 1));
            _mm_storeu_si128(at(2), _mm512_extracti32x4_epi32(v, 2));
            _mm_storeu_si128(at(3), _mm512_extracti32x4_epi32(v, 3));
        }
    }
    static __m512i shuffleBytes(__m512i t, __m512i idx) { return _mm512_shuffle_epi8(t, idx); }
    static __m512i mulAddPairs16(__m512i a, __m512i b) { return _mm512_madd_epi16(a, b); }
    static __m512i mulAddPairs8(__m512i u, __m512i s) { return _mm512_maddubs_epi16(u, s); }
    template <int N>
    static __m512i shiftBytesUp(__m512i a) { return _mm512_bslli_epi128(a, N); }
    template <int N>
    static __m512i shiftBytesDown(__m512i a) { return _mm512_bsrli_epi128(a, N); }
    template <class T>
    static R<T> zipLo(R<T> a, R<T> b) {
        if constexpr (!isInt<T>) return Base::zipLo<T>(a, b);
        else if constexpr (sizeof(T) == 1) return _mm512_unpacklo_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm512_unpacklo_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm512_unpacklo_epi32(a, b);
        else return _mm512_unpacklo_epi64(a, b);
    }
    template <class T>
    static R<T> zipHi(R<T> a, R<T> b) {
        if constexpr (!isInt<T>) return Base::zipHi<T>(a, b);
        else if constexpr (sizeof(T) == 1) return _mm512_unpackhi_epi8(a, b);
        else if constexpr (sizeof(T) == 2) return _mm512_unpackhi_epi16(a, b);
        else if constexpr (sizeof(T) == 4) return _mm512_unpackhi_epi32(a, b);
        else return _mm512_unpackhi_epi64(a, b);
    }
    // The lanes' upper halves when widened: zero, or copies of the sign.
    template <class T>
    static __m512i extension(__m512i a) {
        if constexpr (std::is_unsigned_v<T>) return _mm512_setzero_si512();
        else if constexpr (sizeof(T) == 1) return _mm512_movm_epi8(_mm512_movepi8_mask(a));
        else if constexpr (sizeof(T) == 2) return _mm512_srai_epi16(a, 15);
        else return _mm512_srai_epi32(a, 31);
    }
    template <class T>
    static R<Wider<T>> widenLo(R<T> a) {
        if constexpr (isInt<T> && sizeof(T) <= 4) return zipLo<T>(a, extension<T>(a));
        else return Base::widenLo<T>(a);
    }
    template <class T>
    static R<Wider<T>> widenHi(R<T> a) {
        if constexpr (isInt<T> && sizeof(T) <= 4) return zipHi<T>(a, extension<T>(a));
        else return Base::widenHi<T>(a);
    }
    template <class To, class From>
    static R<To> narrowSat(R<From> lo, R<From> hi) {
        if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, uint8_t>) return _mm512_packus_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, int16_t> && std::is_same_v<To, int8_t>) return _mm512_packs_epi16(lo, hi);
        else if constexpr (std::is_same_v<From, int32_t> && std::is_same_v<To, int16_t>) return _mm512_packs_epi32(lo, hi);
        else return Base::narrowSat<To, From>(lo, hi);
    }
    using Base::addPairs;
    template <class T>
    static R<T> addPairs(R<T> a, R<T> b) {
        if constexpr (std::is_same_v<T, int32_t> || std::is_same_v<T, uint32_t>) return _mm512_add_epi32(_mm512_castps_si512(_mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), 0x88)),
                                    _mm512_castps_si512(_mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), 0xDD)));
        else return Base::addPairs<T>(a, b);
    }

    // 8-byte chunks 0, 2, 4, 6 (lanes 0, 1 of each block) first, then 1, 3, 5, 7.
    static __m512d blockPairsTogether(__m512d a) {
        return _mm512_permutexvar_pd(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), a);
    }
    static __m512d blockPairsApart(__m512d a) {
        return _mm512_permutexvar_pd(_mm512_setr_epi64(0, 4, 1, 5, 2, 6, 3, 7), a);
    }
    static __m512i blockPairsTogether(__m512i a) {
        return _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), a);
    }
    static __m512d int32ToDoubleLo(__m512i a) { return _mm512_cvtepi32_pd(_mm512_castsi512_si256(blockPairsTogether(a))); }
    static __m512d int32ToDoubleHi(__m512i a) { return _mm512_cvtepi32_pd(_mm512_extracti64x4_epi64(blockPairsTogether(a), 1)); }
    static __m512d gatherDoubleLo(const double* t, __m512i i) {
        return _mm512_i32gather_pd(_mm512_castsi512_si256(blockPairsTogether(i)), t, 8);
    }
    static __m512d gatherDoubleHi(const double* t, __m512i i) {
        return _mm512_i32gather_pd(_mm512_extracti64x4_epi64(blockPairsTogether(i), 1), t, 8);
    }
    // Rows from general-register addresses, one 16-byte load each: faster
    // than two gathers of their halves.
    static __m512d rowsOf(const double* t, int32_t a, int32_t b, int32_t c, int32_t d) {
        __m512d r = _mm512_castpd128_pd512(_mm_loadu_pd(t + uint32_t(a)));
        r = _mm512_insertf64x2(r, _mm_loadu_pd(t + uint32_t(b)), 1);
        r = _mm512_insertf64x2(r, _mm_loadu_pd(t + uint32_t(c)), 2);
        return _mm512_insertf64x2(r, _mm_loadu_pd(t + uint32_t(d)), 3);
    }
    static void gatherRowsLo(const double* t, const int32_t* i, __m512d& first, __m512d& second) {
        const __m512d a = rowsOf(t, i[0], i[4], i[8], i[12]), b = rowsOf(t, i[1], i[5], i[9], i[13]);
        first = _mm512_unpacklo_pd(a, b);
        second = _mm512_unpackhi_pd(a, b);
    }
    static void gatherRowsHi(const double* t, const int32_t* i, __m512d& first, __m512d& second) {
        gatherRowsLo(t, i + 2, first, second);
    }

    // Reinterpretations: no instruction.
    template <class To, class From>
    static R<To> bitcast(R<From> a) {
        if constexpr (isF<To> == isF<From> && isD<To> == isD<From>) return a;  // the same register type
        else if constexpr (isF<To>) {
            if constexpr (isD<From>) return _mm512_castpd_ps(a);
            else return _mm512_castsi512_ps(a);
        } else if constexpr (isD<To>) {
            if constexpr (isF<From>) return _mm512_castps_pd(a);
            else return _mm512_castsi512_pd(a);
        } else {
            if constexpr (isF<From>) return _mm512_castps_si512(a);
            else return _mm512_castpd_si512(a);
        }
    }
    // Shifts by a run-time count, one instruction.
    template <class T>
    static R<T> shl(R<T> a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (sizeof(T) == 2) return _mm512_sll_epi16(a, c);
        else if constexpr (sizeof(T) == 4) return _mm512_sll_epi32(a, c);
        else if constexpr (sizeof(T) == 8) return _mm512_sll_epi64(a, c);
        else return Base::shl<T>(a, n);
    }
    template <class T>
    static R<T> shr(R<T> a, int n) {
        const __m128i c = _mm_cvtsi32_si128(n);
        if constexpr (std::is_same_v<T, uint16_t>) return _mm512_srl_epi16(a, c);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm512_sra_epi16(a, c);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm512_srl_epi32(a, c);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_sra_epi32(a, c);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm512_srl_epi64(a, c);
        else return Base::shr<T>(a, n);
    }
    template <class T, int N>
    static R<T> shl(R<T> a) {
        if constexpr (sizeof(T) == 2) return _mm512_slli_epi16(a, N);
        else if constexpr (sizeof(T) == 4) return _mm512_slli_epi32(a, N);
        else if constexpr (sizeof(T) == 8) return _mm512_slli_epi64(a, N);
        else return Base::shl<T, N>(a);
    }
    template <class T, int N>
    static R<T> shr(R<T> a) {
        if constexpr (std::is_same_v<T, uint16_t>) return _mm512_srli_epi16(a, N);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm512_srai_epi16(a, N);
        else if constexpr (std::is_same_v<T, uint32_t>) return _mm512_srli_epi32(a, N);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_srai_epi32(a, N);
        else if constexpr (std::is_same_v<T, uint64_t>) return _mm512_srli_epi64(a, N);
        else return Base::shr<T, N>(a);
    }
    template <class T>
    static R<T> concatEven(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatEven of 32-bit lanes");
        if constexpr (isF<T>) return _mm512_shuffle_ps(a, b, _MM_SHUFFLE(2, 0, 2, 0));
        else return _mm512_castps_si512(_mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(2, 0, 2, 0)));
    }
    template <class T>
    static R<T> concatOdd(R<T> a, R<T> b) {
        static_assert(sizeof(T) == 4, "concatOdd of 32-bit lanes");
        if constexpr (isF<T>) return _mm512_shuffle_ps(a, b, _MM_SHUFFLE(3, 1, 3, 1));
        else return _mm512_castps_si512(_mm512_shuffle_ps(_mm512_castsi512_ps(a), _mm512_castsi512_ps(b), _MM_SHUFFLE(3, 1, 3, 1)));
    }
    // The sign bits of the lanes (of the bytes for integer lanes), as the
    // 16-byte movemasks read masks.
    template <class T>
    static uint64_t maskBits(R<T> m) {
        if constexpr (isF<T>) return _mm512_movepi32_mask(_mm512_castps_si512(m));
        else if constexpr (isD<T>) return _mm512_movepi64_mask(_mm512_castpd_si512(m));
        else return _mm512_movepi8_mask(m);
    }
    template <class T>
    static bool anyTrue(R<T> m) { return maskBits<T>(m) != 0; }
    template <class T>
    static bool allTrue(R<T> m) { return maskBits<T>(m) == (isF<T> ? 0xFFFFu : isD<T> ? 0xFFu : ~uint64_t(0)); }
    static __m512 int32ToFloat(__m512i a) { return _mm512_cvtepi32_ps(a); }
    static __m512i floatToInt32(__m512 a) { return _mm512_cvtps_epi32(a); }
    static __m512i floatToInt32Trunc(__m512 a) { return _mm512_cvttps_epi32(a); }
    static __m512d floatToDoubleLo(__m512 a) {
        return _mm512_cvtps_pd(_mm512_castps512_ps256(_mm512_castpd_ps(blockPairsTogether(_mm512_castps_pd(a)))));
    }
    static __m512d floatToDoubleHi(__m512 a) {
        return _mm512_cvtps_pd(_mm512_extractf32x8_ps(_mm512_castpd_ps(blockPairsTogether(_mm512_castps_pd(a))), 1));
    }
    static __m512 doubleToFloat(__m512d lo, __m512d hi) {
        return _mm512_castpd_ps(blockPairsApart(_mm512_castps_pd(doubleToFloatInOrder(lo, hi))));
    }
    static __m512 doubleToFloatInOrder(__m512d lo, __m512d hi) {
        return _mm512_insertf32x8(_mm512_castps256_ps512(_mm512_cvtpd_ps(lo)), _mm512_cvtpd_ps(hi), 1);
    }

    // -- whole-register lane order (see Isa<32>)
    template <class T, class Half>
    static R<Wider<T>> widenHalf(Half h) {
        if constexpr (isF<T>) return _mm512_cvtps_pd(h);
        else if constexpr (std::is_same_v<T, int8_t>) return _mm512_cvtepi8_epi16(h);
        else if constexpr (std::is_same_v<T, uint8_t>) return _mm512_cvtepu8_epi16(h);
        else if constexpr (std::is_same_v<T, int16_t>) return _mm512_cvtepi16_epi32(h);
        else if constexpr (std::is_same_v<T, uint16_t>) return _mm512_cvtepu16_epi32(h);
        else if constexpr (std::is_same_v<T, int32_t>) return _mm512_cvtepi32_epi64(h);
        else return _mm512_cvtepu32_epi64(h);
    }
    template <class T>
    static R<Wider<T>> widenLoInOrder(R<T> a) { return widenHalf<T>(lo<T>(a)); }
    template <class T>
    static R<Wider<T>> widenHiInOrder(R<T> a) { return widenHalf<T>(hi<T>(a)); }
    template <class W, class N>
    static R<W> loadWidened(const N* p) {
        return widenHalf<N>(Isa<32>::template load<N>(p));
    }
    template <class To, class From>
    static constexpr bool kPacksInOrder =
        std::is_same_v<From, int32_t> ? (std::is_same_v<To, int16_t> || std::is_same_v<To, uint16_t>)
                                      : std::is_same_v<From, int16_t> && (std::is_same_v<To, int8_t> || std::is_same_v<To, uint8_t>);
    template <class To, class From>
    static R<To> narrowSatInOrder(R<From> l, R<From> h) {
        if constexpr (isD<From>) {
            return join<float>(_mm512_cvtpd_ps(l), _mm512_cvtpd_ps(h));
        } else if constexpr (kPacksInOrder<To, From>) {
            __m512i packed;
            if constexpr (std::is_same_v<To, int16_t>) packed = _mm512_packs_epi32(l, h);
            else if constexpr (std::is_same_v<To, uint16_t>) packed = _mm512_packus_epi32(l, h);
            else if constexpr (std::is_same_v<To, int8_t>) packed = _mm512_packs_epi16(l, h);
            else packed = _mm512_packus_epi16(l, h);
            return _mm512_permutexvar_epi64(_mm512_setr_epi64(0, 2, 4, 6, 1, 3, 5, 7), packed);
        } else {
            return join<To>(Isa<32>::template narrowSatInOrder<To, From>(lo<From>(l), hi<From>(l)),
                            Isa<32>::template narrowSatInOrder<To, From>(lo<From>(h), hi<From>(h)));
        }
    }
};
#  endif  // ZOR_WIDTH >= 64
#endif  // ZOR_WIDTH >= 32

// ---- the vocabulary -----------------------------------------------------------
// Free functions over Vec<T, B>; each forwards to Isa<B>.

template <class V>
inline std::enable_if_t<!std::is_arithmetic_v<V>, V> zero() { return {Isa<V::kBytes>::template zero<typename V::Lane>()}; }
template <class V>
inline V set1(typename V::Lane x) { return {Isa<V::kBytes>::template set1<typename V::Lane>(x)}; }
// Loads V::kLanes lanes from p (any alignment).
template <class V>
inline V load(const typename V::Lane* p) { return {Isa<V::kBytes>::template load<typename V::Lane>(p)}; }
template <class V>
inline V loadAligned(const typename V::Lane* p) {
    return {Isa<V::kBytes>::template loadAligned<typename V::Lane>(p)};
}
// The lower half of the lanes from p, the rest zero.
template <class V>
inline V loadHalf(const typename V::Lane* p) {
    return {Isa<V::kBytes>::template loadHalf<typename V::Lane>(p)};
}
// Lane block b (16 bytes) from p + b * blockStride lanes: tables laid out
// 16 bytes at a time, read at any width.  At 16 bytes this is load().
template <class V>
inline V loadBlocks(const typename V::Lane* p, ptrdiff_t blockStride) {
    return {Isa<V::kBytes>::template loadBlocks<typename V::Lane>(p, blockStride)};
}
// Lane block b (16 bytes) from blocks[b] + offset lanes: blocks gathered
// from unrelated places (one 16-byte load each).  At 16 bytes this is
// load(blocks[0] + offset).
template <class V>
inline V loadBlocksAt(const typename V::Lane* const* blocks, ptrdiff_t offset) {
    return {Isa<V::kBytes>::template loadBlocksAt<typename V::Lane>(blocks, offset)};
}
// Lane block b to p + b * blockStride lanes.
template <class T, int B>
inline void storeBlocks(T* p, ptrdiff_t blockStride, Vec<T, B> v) {
    Isa<B>::template storeBlocks<T>(p, blockStride, v.raw);
}
// f(b, block b as a Vec<T, 16>) for every 16-byte block b, in order.
template <class T, int B, class F>
inline void eachBlock(Vec<T, B> v, F&& f) {
    Isa<B>::template eachBlock<T>(v.raw, 0, [&](int b, typename RawOf<T, 16>::type r) { f(b, Vec<T, 16>{r}); });
}
template <class T, int B>
inline void store(T* p, Vec<T, B> v) { Isa<B>::template store<T>(p, v.raw); }
template <class T, int B>
inline void storeAligned(T* p, Vec<T, B> v) { Isa<B>::template storeAligned<T>(p, v.raw); }
// Stores the lower half of the lanes.
template <class T, int B>
inline void storeHalf(T* p, Vec<T, B> v) { Isa<B>::template storeHalf<T>(p, v.raw); }
// Non-temporal store to memory aligned to the register width.
template <class T, int B>
inline void stream(T* p, Vec<T, B> v) { Isa<B>::template stream<T>(p, v.raw); }
// Orders the non-temporal stores before it ahead of every later store: a
// kernel that streams calls it once before it returns, so that its results
// are seen like those of plain stores.
inline void streamFence() {
#if ZOR_SIMD >= 1
    _mm_sfence();
#endif
}

// Brings the cache line holding p closer; p may lie beyond the data.
template <class V>
inline void prefetch(const void* p) { Isa<V::kBytes>::prefetch(p); }

// Loads from (and stores to) memory of any lane type: for moving bytes.
template <class V, class U>
inline V loadFrom(const U* p) { return load<V>(reinterpret_cast<const typename V::Lane*>(p)); }
template <class T, int B, class U>
inline void storeTo(U* p, Vec<T, B> v) { store(reinterpret_cast<T*>(p), v); }

// N consecutive registers from memory of any lane type, and back: blocks
// that span several registers (48 bytes of three-channel pixels).
template <class V, int N, class U>
inline void loadBlock(const U* p, V (&v)[N]) {
    for (int i = 0; i < N; ++i) v[i] = loadFrom<V>(reinterpret_cast<const uint8_t*>(p) + i * V::kBytes);
}
template <class T, int B, int N, class U>
inline void storeBlock(U* p, const Vec<T, B> (&v)[N]) {
    for (int i = 0; i < N; ++i) storeTo(reinterpret_cast<uint8_t*>(p) + i * B, v[i]);
}

template <class T, int B>
inline Vec<T, B> operator+(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template add<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator-(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template sub<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator*(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template mul<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator/(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template div<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator&(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template bitAnd<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator|(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template bitOr<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator^(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template bitXor<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B>& operator+=(Vec<T, B>& a, Vec<T, B> b) { return a = a + b; }
template <class T, int B>
inline Vec<T, B>& operator-=(Vec<T, B>& a, Vec<T, B> b) { return a = a - b; }
template <class T, int B>
inline Vec<T, B>& operator|=(Vec<T, B>& a, Vec<T, B> b) { return a = a | b; }
// ~a & b
template <class T, int B>
inline Vec<T, B> andNot(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template andNot<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> operator~(Vec<T, B> a) { return andNot(a, Vec<T, B>{Isa<B>::template allOnes<T>()}); }

template <class T, int B>
inline Vec<T, B> sqrt(Vec<T, B> a) { return {Isa<B>::template sqrt<T>(a.raw)}; }
template <class T, int B>
inline Vec<T, B> min(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template min<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> max(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template max<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> addSat(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template addSat<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> subSat(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template subSat<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> avg(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template avg<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> absDiff(Vec<T, B> a, Vec<T, B> b) {
    static_assert(std::is_unsigned_v<T> && sizeof(T) <= 2, "absolute difference of unsigned 8/16-bit lanes");
    return subSat(a, b) | subSat(b, a);
}
// |a| of signed lanes; the lowest value stays as it is.
template <class T, int B>
inline Vec<T, B> abs(Vec<T, B> a) {
    if constexpr (std::is_floating_point_v<T>) return andNot(set1<Vec<T, B>>(T(-0.0)), a);
    else return {Isa<B>::template abs<T>(a.raw)};
}
template <class T, int B>
inline Vec<T, B> mulHi(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template mulHi<T>(a.raw, b.raw)}; }

// Comparisons give masks: every bit of a lane set where the relation holds.
template <class T, int B>
inline Vec<T, B> eq(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template eq<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> gt(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template gt<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> lt(Vec<T, B> a, Vec<T, B> b) { return gt(b, a); }
template <class T, int B>
inline Vec<T, B> ge(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template ge<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> le(Vec<T, B> a, Vec<T, B> b) { return ge(b, a); }
// mask ? a : b, lane by lane (mask lanes all ones or all zeros).
template <class T, int B>
inline Vec<T, B> select(Vec<T, B> mask, Vec<T, B> a, Vec<T, B> b) {
    return {Isa<B>::template select<T>(mask.raw, a.raw, b.raw)};
}
// Bit k set when lane k's top bit is set (lanes of 16 bits or more: the
// lane's sign; bytes: one bit per byte).
template <class T, int B>
inline int laneMask(Vec<T, B> a) { return Isa<B>::template laneMask<T>(a.raw); }
// Tests of masks (lanes all ones or all zeros).
template <class T, int B>
inline bool anyTrue(Vec<T, B> mask) { return Isa<B>::template anyTrue<T>(mask.raw); }
template <class T, int B>
inline bool allTrue(Vec<T, B> mask) { return Isa<B>::template allTrue<T>(mask.raw); }
// The index of the first set lane of a mask, kLanes when none is set.
template <class T, int B>
inline int firstTrue(Vec<T, B> mask) { return Isa<B>::template firstTrue<T>(mask.raw); }

// Lane I as a scalar (8, 16 and 32-bit integers, float, double).
template <int I, class T, int B>
inline T getLane(Vec<T, B> a) { return Isa<B>::template getLane<I, T>(a.raw); }
// The lanes in reverse order (over the whole register).
template <class T, int B>
inline Vec<T, B> reverseLanes(Vec<T, B> a) { return {Isa<B>::template reverseLanes<T>(a.raw)}; }
// Per 16-byte block, 32-bit lanes: a0 a2 b0 b2 (concatEven), a1 a3 b1 b3
// (concatOdd): interleaved pairs split apart.
template <class T, int B>
inline Vec<T, B> concatEven(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template concatEven<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> concatOdd(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template concatOdd<T>(a.raw, b.raw)}; }
// Per 16-byte block, 32-bit lanes: the 4 x 4 matrix whose rows are a, b, c,
// d, transposed in place.
template <class T, int B>
inline void transpose4(Vec<T, B>& a, Vec<T, B>& b, Vec<T, B>& c, Vec<T, B>& d) {
    Isa<B>::template transpose4<T>(a.raw, b.raw, c.raw, d.raw);
}
// The 16-byte blocks of a, b, c, d (n = kBytes / 16 per register) as the
// rows of squares of n registers, each square transposed: afterwards
// register r holds block r % n of the registers n (r / n) .. n (r / n) + n - 1
// of before, in that order.  With n = 4 that is one 4 x 4 square; with 2,
// the pairs a, b and c, d; with 1 nothing moves.
template <class T, int B>
inline void transposeBlocks4(Vec<T, B>& a, Vec<T, B>& b, Vec<T, B>& c, Vec<T, B>& d) {
    Isa<B>::template transposeBlocks4<T>(a.raw, b.raw, c.raw, d.raw);
}
// An estimate of 1/a with a relative error below 1.5 * 2^-12.
template <int B>
inline Vec<float, B> recipApprox(Vec<float, B> a) { return {Isa<B>::recipApprox(a.raw)}; }
// Per 16-byte block: a0 + a1, b0 + b1 of double lanes.
template <int B>
inline Vec<double, B> addPairs(Vec<double, B> a, Vec<double, B> b) { return {Isa<B>::addPairs(a.raw, b.raw)}; }
template <class V, std::enable_if_t<!std::is_arithmetic_v<V>, int> = 0>
inline V asLanes(V mask) { return mask; }

template <int N, class T, int B>
inline Vec<T, B> shl(Vec<T, B> a) { return {Isa<B>::template shl<T, N>(a.raw)}; }
// Logical for unsigned lanes, arithmetic for signed ones.
template <int N, class T, int B>
inline Vec<T, B> shr(Vec<T, B> a) { return {Isa<B>::template shr<T, N>(a.raw)}; }
template <class T, int B>
inline Vec<T, B> shl(Vec<T, B> a, int n) { return {Isa<B>::template shl<T>(a.raw, n)}; }
template <class T, int B>
inline Vec<T, B> shr(Vec<T, B> a, int n) { return {Isa<B>::template shr<T>(a.raw, n)}; }

template <class To, class From, int B>
inline Vec<To, B> bitcast(Vec<From, B> a) { return {Isa<B>::template bitcast<To, From>(a.raw)}; }


// Per 16-byte block: the lower (upper) half of the lanes, widened (zero- or
// sign-extended by T's signedness; floats to double).  Use bitcast for the
// other signedness of the result.
template <class T, int B>
inline Vec<Wider<T>, B> widenLo(Vec<T, B> a) {
    if constexpr (std::is_same_v<T, float>) return {Isa<B>::floatToDoubleLo(a.raw)};
    else return {Isa<B>::template widenLo<T>(a.raw)};
}
template <class T, int B>
inline Vec<Wider<T>, B> widenHi(Vec<T, B> a) {
    if constexpr (std::is_same_v<T, float>) return {Isa<B>::floatToDoubleHi(a.raw)};
    else return {Isa<B>::template widenHi<T>(a.raw)};
}
// Per 16-byte block: narrows lo and hi into one register of To lanes,
// saturating to To's range (the inverse of widenLo/widenHi).  double to
// float rounds by the current mode.
template <class To, class From, int B>
inline Vec<To, B> narrowSat(Vec<From, B> lo, Vec<From, B> hi) {
    if constexpr (std::is_same_v<From, double>) return {Isa<B>::doubleToFloat(lo.raw, hi.raw)};
    else return {Isa<B>::template narrowSat<To, From>(lo.raw, hi.raw)};
}
// The same in the lane order of the whole register (equal to widenLo /
// widenHi and narrowSat in 16-byte registers): the lower (upper) half of
// a's lanes widened, and lo's lanes followed by hi's narrowed with
// saturation.  For kernels that widen on the way in or narrow on the way
// out (conversions between memory of two lane sizes).
template <class T, int B>
inline Vec<Wider<T>, B> widenLoInOrder(Vec<T, B> a) {
    if constexpr (B == 16) return widenLo(a);
    else return {Isa<B>::template widenLoInOrder<T>(a.raw)};
}
template <class T, int B>
inline Vec<Wider<T>, B> widenHiInOrder(Vec<T, B> a) {
    if constexpr (B == 16) return widenHi(a);
    else return {Isa<B>::template widenHiInOrder<T>(a.raw)};
}
template <class To, class From, int B>
inline Vec<To, B> narrowSatInOrder(Vec<From, B> lo, Vec<From, B> hi) {
    if constexpr (B == 16) return narrowSat<To>(lo, hi);
    else return {Isa<B>::template narrowSatInOrder<To, From>(lo.raw, hi.raw)};
}
// V::kLanes values of the lane type half as wide from p, widened in order
// (zero- or sign-extended by N's signedness; floats to double).
template <class V, class N>
inline V loadWidened(const N* p) {
    static_assert(sizeof(N) * 2 == sizeof(typename V::Lane), "loadWidened doubles the lane size");
    if constexpr (V::kBytes == 16) return bitcast<typename V::Lane>(widenLo(loadHalf<Vec<N, 16>>(p)));
    else return {Isa<V::kBytes>::template loadWidened<typename V::Lane, N>(p)};
}
// Doubles lo (the first half of the lanes) and hi (the second) rounded to
// floats in order: the inverse of loadWidened (narrowSat works per 16-byte
// block instead).
template <class To, class From, int B>
inline Vec<To, B> narrowInOrder(Vec<From, B> lo, Vec<From, B> hi) {
    static_assert(std::is_same_v<To, float> && std::is_same_v<From, double>, "narrowInOrder of doubles to floats");
    return {Isa<B>::doubleToFloatInOrder(lo.raw, hi.raw)};
}
// Per 16-byte block: keeps the low bits of every lane.
template <class To, class From, int B>
inline Vec<To, B> narrowTrunc(Vec<From, B> lo, Vec<From, B> hi) {
    return {Isa<B>::template narrowTrunc<To, From>(lo.raw, hi.raw)};
}
// Per 16-byte block: a0 b0 a1 b1 ... of the lower (upper) halves.
template <class T, int B>
inline Vec<T, B> zipLo(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template zipLo<T>(a.raw, b.raw)}; }
template <class T, int B>
inline Vec<T, B> zipHi(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template zipHi<T>(a.raw, b.raw)}; }

template <int B>
inline Vec<float, B> toFloat(Vec<int32_t, B> a) { return {Isa<B>::int32ToFloat(a.raw)}; }
// Rounds by MXCSR (hold a ConversionScope for nearest-even); INT_MIN for NaN
// and out-of-range lanes.
template <int B>
inline Vec<int32_t, B> toInt32(Vec<float, B> a) { return {Isa<B>::floatToInt32(a.raw)}; }
template <int B>
inline Vec<int32_t, B> toInt32Trunc(Vec<float, B> a) { return {Isa<B>::floatToInt32Trunc(a.raw)}; }
// Per 16-byte block, like widenLo/widenHi of floats: lanes 0, 1 (Lo) or
// 2, 3 (Hi) of 32-bit integers as doubles.
template <int B>
inline Vec<double, B> toDoubleLo(Vec<int32_t, B> a) { return {Isa<B>::int32ToDoubleLo(a.raw)}; }
template <int B>
inline Vec<double, B> toDoubleHi(Vec<int32_t, B> a) { return {Isa<B>::int32ToDoubleHi(a.raw)}; }
// Table lookups, per 16-byte block like toDoubleLo/toDoubleHi: table[i] for
// the 32-bit indices i in lanes 0, 1 (Lo) or 2, 3 (Hi).  Every index must
// lie inside the table.  16-byte registers load lane by lane, wider ones
// gather in one instruction.
template <int B>
inline Vec<double, B> gatherLo(const double* table, Vec<int32_t, B> idx) {
    return {Isa<B>::gatherDoubleLo(table, idx.raw)};
}
template <int B>
inline Vec<double, B> gatherHi(const double* table, Vec<int32_t, B> idx) {
    return {Isa<B>::gatherDoubleHi(table, idx.raw)};
}
// table[idx[l]] for the lanes l of V (doubles) in order, the indices read
// from memory, loaded lane by lane at every width.  Where the indices can
// be stored a while before the lookup, this beats the native gathers.
template <class V>
inline V gather(const double* table, const int32_t* idx) {
    static_assert(std::is_same_v<typename V::Lane, double>, "gather of doubles");
    return {Isa<V::kBytes>::gatherDouble(table, idx)};
}
// Rows of two doubles at table + idx[l], for the register's lanes l held
// in memory (loaded from general registers: indices computed there cost no
// transfers out of the vector unit), per 16-byte block like gatherLo /
// gatherHi: their first and second doubles.
template <int B>
inline void gatherRowsLo(const double* table, const int32_t* idx, Vec<double, B>& first, Vec<double, B>& second) {
    Isa<B>::gatherRowsLo(table, idx, first.raw, second.raw);
}
template <int B>
inline void gatherRowsHi(const double* table, const int32_t* idx, Vec<double, B>& first, Vec<double, B>& second) {
    Isa<B>::gatherRowsHi(table, idx, first.raw, second.raw);
}
// Two registers of doubles into one of 32-bit integers (rounded by MXCSR,
// or truncated); INT_MIN for NaN and out-of-range lanes.
template <int B>
inline Vec<int32_t, B> toInt32(Vec<double, B> lo, Vec<double, B> hi) {
    return {Isa<B>::doubleToInt32(lo.raw, hi.raw)};
}
// The same, rounded toward zero whatever MXCSR says.
template <int B>
inline Vec<int32_t, B> toInt32Trunc(Vec<double, B> lo, Vec<double, B> hi) {
    return {Isa<B>::doubleToInt32Trunc(lo.raw, hi.raw)};
}

// Neighbouring 16-bit lanes multiplied and summed into 32-bit lanes.
template <int B>
inline Vec<int32_t, B> mulAddPairs(Vec<int16_t, B> a, Vec<int16_t, B> b) {
    return {Isa<B>::mulAddPairs16(a.raw, b.raw)};
}
// Unsigned times signed neighbouring bytes, summed and saturated to 16 bits.
template <int B>
inline Vec<int16_t, B> mulAddPairs(Vec<uint8_t, B> u, Vec<int8_t, B> s) {
    return {Isa<B>::mulAddPairs8(u.raw, s.raw)};
}
// (a b + 2^14) >> 15
template <int B>
inline Vec<int16_t, B> mulHiRound(Vec<int16_t, B> a, Vec<int16_t, B> b) {
    return {Isa<B>::mulHiRound(a.raw, b.raw)};
}
// Per 8 bytes the sum of |a - b| into a 64-bit lane.
template <int B>
inline Vec<uint64_t, B> sumAbsDiff(Vec<uint8_t, B> a, Vec<uint8_t, B> b) {
    return {Isa<B>::sumAbsDiff8(a.raw, b.raw)};
}
// Per 16-byte block: sums of neighbouring 32-bit lanes, a's pairs then b's.
template <class T, int B>
inline Vec<T, B> addPairs(Vec<T, B> a, Vec<T, B> b) { return {Isa<B>::template addPairs<T>(a.raw, b.raw)}; }
// Three interleaved byte channels (a0 b0 c0 a1 ...: 3 * kLanes bytes) to
// three registers and back.
template <int B>
inline void loadInterleaved3(const uint8_t* p, Vec<uint8_t, B>& a, Vec<uint8_t, B>& b, Vec<uint8_t, B>& c) {
    Isa<B>::loadInterleaved3(p, a.raw, b.raw, c.raw);
}
template <int B>
inline void storeInterleaved3(uint8_t* p, Vec<uint8_t, B> a, Vec<uint8_t, B> b, Vec<uint8_t, B> c) {
    Isa<B>::storeInterleaved3(p, a.raw, b.raw, c.raw);
}
// Per 16-byte block: byte i is table[idx[i] & 15], zero where idx[i] >= 128.
template <int B>
inline Vec<uint8_t, B> shuffleBytes(Vec<uint8_t, B> table, Vec<uint8_t, B> idx) {
    return {Isa<B>::shuffleBytes(table.raw, idx.raw)};
}
// Per 16-byte block: bytes N .. N+15 of hi:lo.
template <int N, class T, int B>
inline Vec<T, B> alignBytes(Vec<T, B> hi, Vec<T, B> lo) {
    return {Isa<B>::template alignBytes<N, T>(hi.raw, lo.raw)};
}
// Per 16-byte block: moves the bytes N places up (towards the last lane),
// shifting in zeros; shiftBytesDown the other way.
template <int N, class T, int B>
inline Vec<T, B> shiftBytesUp(Vec<T, B> a) { return {Isa<B>::template shiftBytesUp<N>(a.raw)}; }
template <int N, class T, int B>
inline Vec<T, B> shiftBytesDown(Vec<T, B> a) { return {Isa<B>::template shiftBytesDown<N>(a.raw)}; }

// Lane order over the whole register (not per 16-byte block), float lanes:
// deinterleave reads a then b as one run of 2n lanes and returns its even
// lanes (a0 a2 ... b0 b2 ...) and its odd lanes; interleave undoes it
// (lo = e0 o0 e1 o1 ..., hi = the second half of that run).  transpose
// takes kLanes registers as the rows of a square and transposes it.
template <int B>
inline void deinterleave(Vec<float, B> a, Vec<float, B> b, Vec<float, B>& even, Vec<float, B>& odd) {
    Isa<B>::deinterleave(a.raw, b.raw, even.raw, odd.raw);
}
template <int B>
inline void interleave(Vec<float, B> even, Vec<float, B> odd, Vec<float, B>& lo, Vec<float, B>& hi) {
    Isa<B>::interleave(even.raw, odd.raw, lo.raw, hi.raw);
}
// (The row count is a template parameter of its own: clang cannot parse a
// dependent array bound in this declarator.)
template <int B, int N>
inline void transpose(Vec<float, B> (&rows)[N]) {
    static_assert(N == Vec<float, B>::kLanes, "a square of kLanes rows");
    typename Vec<float, B>::Raw r[N];
    for (int i = 0; i < Vec<float, B>::kLanes; ++i) r[i] = rows[i].raw;
    Isa<B>::transpose(r);
    for (int i = 0; i < Vec<float, B>::kLanes; ++i) rows[i].raw = r[i];
}

// A constant register from a table of lanes (kLanes entries).
template <class V>
inline V fromLanes(const typename V::Lane (&lanes)[V::kLanes]) { return load<V>(lanes); }

// ---- horizontal reductions ----------------------------------------------------
// Integer sums wrap around in the lane type.  Float sums add in a fixed
// order: lane i and lane i + n/2, halving until one is left, so four lanes
// give (l0 + l2) + (l1 + l3), each addition with its left operand first (the
// NaN a sum of two NaNs keeps is the left one's, as the scalar a + b of the
// generic code gives it).  Widen first where a sum needs more range.

template <class T, int B>
inline T reduceAdd(Vec<T, B> v) {
    if constexpr (std::is_floating_point_v<T>) return Isa<B>::template reduceAdd<T>(v.raw);
    alignas(64) T l[Vec<T, B>::kLanes];
    storeAligned(l, v);
    for (int half = Vec<T, B>::kLanes / 2; half >= 1; half /= 2)
        for (int i = 0; i < half; ++i) l[i] = T(l[i] + l[i + half]);
    return l[0];
}
template <class T, int B>
inline T reduceMin(Vec<T, B> v) {
    alignas(64) T l[Vec<T, B>::kLanes];
    storeAligned(l, v);
    T r = l[0];
    for (int i = 1; i < Vec<T, B>::kLanes; ++i) r = min(l[i], r);
    return r;
}
template <class T, int B>
inline T reduceMax(Vec<T, B> v) {
    alignas(64) T l[Vec<T, B>::kLanes];
    storeAligned(l, v);
    T r = l[0];
    for (int i = 1; i < Vec<T, B>::kLanes; ++i) r = max(l[i], r);
    return r;
}

// ---- loops --------------------------------------------------------------------
// d[i] = op(s[i]) for i < n: a cache line of registers at a time while they
// fit, then single registers, then one element at a time.  op is called with
// Vec<S> and with S (a generic lambda over the names above serves both) and
// gives Vec<D> / D; D and S must have the same size.  An op that takes lanes
// only runs lane by lane.  Reads every source element before the store of
// its register, so d == s works.
//
// The sources are requested kPrefetchBytes ahead: with two or three streams
// at once the processor's own prefetching falls behind (an 8-bit sum of two
// 1920 x 1080 images from L3 runs about a fifth faster).
constexpr ptrdiff_t kPrefetchBytes = 1024;

// Whether op takes Arity registers of S (false where the column has none).
template <class Op, class S, int Arity>
constexpr bool takesRegisters() {
    if constexpr (!kHas<S>) return false;
    else if constexpr (Arity == 1) return std::is_invocable_v<Op&, Vec<S>>;
    else return std::is_invocable_v<Op&, Vec<S>, Vec<S>>;
}

template <class D, class S, class Op>
inline void mapLanes(const S* s, D* d, ptrdiff_t n, Op op) {
    ptrdiff_t i = 0;
    if constexpr (kHas<D> && takesRegisters<Op, S, 1>()) {
        static_assert(sizeof(S) == sizeof(D), "mapLanes keeps the lane count");
        using V = Vec<S>;
        constexpr int L = V::kLanes, R = V::kBytes >= 64 ? 1 : 64 / V::kBytes;  // registers a line
        for (; i + R * L <= n; i += R * L) {
            prefetch<V>(s + i + kPrefetchBytes / ptrdiff_t(sizeof(S)));
            V x[R];
            for (int k = 0; k < R; ++k) x[k] = load<V>(s + i + k * L);
            for (int k = 0; k < R; ++k) store(d + i + k * L, op(x[k]));
        }
        for (; i + L <= n; i += L) store(d + i, op(load<V>(s + i)));
    }
    for (; i < n; ++i) d[i] = op(s[i]);
}
// d[i] = op(a[i], b[i]).
template <class D, class S, class Op>
inline void mapLanes(const S* a, const S* b, D* d, ptrdiff_t n, Op op) {
    ptrdiff_t i = 0;
    if constexpr (kHas<D> && takesRegisters<Op, S, 2>()) {
        static_assert(sizeof(S) == sizeof(D), "mapLanes keeps the lane count");
        using V = Vec<S>;
        constexpr int L = V::kLanes, R = V::kBytes >= 64 ? 1 : 64 / V::kBytes;
        for (; i + R * L <= n; i += R * L) {
            prefetch<V>(a + i + kPrefetchBytes / ptrdiff_t(sizeof(S)));
            prefetch<V>(b + i + kPrefetchBytes / ptrdiff_t(sizeof(S)));
            V x[R], y[R];
            for (int k = 0; k < R; ++k) x[k] = load<V>(a + i + k * L), y[k] = load<V>(b + i + k * L);
            for (int k = 0; k < R; ++k) store(d + i + k * L, op(x[k], y[k]));
        }
        for (; i + L <= n; i += L) store(d + i, op(load<V>(a + i), load<V>(b + i)));
    }
    for (; i < n; ++i) d[i] = op(a[i], b[i]);
}

}}}  // namespace zor::ZOR_INLINE_NS::simd
