// Row passes of the separable resize.
//
// A destination row is made in two passes: the rows pass combines the
// source rows of its vertical taps, element by element, into one
// intermediate row; the columns pass combines, for every destination
// element, the intermediate elements of its horizontal taps (consecutive
// pixels, C elements apart).  Three arithmetics share the passes:
//
//   FixedPoint   8u, at most 8 taps: weights in 1/16384 (int16); a rows term
//                p w rounded to 1/64 of a level (the intermediate, int16), a
//                columns term v w rounded to 1/32; the sum rounded half up
//                and saturated.  Every rounding is (a b + 2^14) >> 15 of a
//                16-bit a, b: the pmulhrsw instruction.
//   FloatPoint   float weights; each sum formed in tap order, every product
//                and addition rounded to float (error at most (taps + 1)
//                2^-24 of the terms' magnitudes a pass): 16u up to 8 taps
//                (0.12 of a level in all), 32f up to 32 (5e-6 relative), 8u
//                up to 1024 (0.04 of a level); integers round half up and
//                saturate.
//   DoublePoint  wider footprints: the same in double.
// Tables of narrow footprints (the columns of the first two) are uniform;
// others give each destination pixel its own tap count.
//
// From the SSSE3 variant on the columns pass gathers the taps of 16-byte
// blocks of destination elements with byte shuffles from 16-byte windows of
// the intermediate row (GatherPlan), computed once per call; a wider
// register takes several consecutive blocks at once, each block's windows
// loaded from its own place.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

#include "frame/fpu.h"
#include "frame/simd.h"
#include "image/geometry/resize_kernels.h"

namespace zor { namespace ZOR_NS { namespace {

// ---- the gather plan ---------------------------------------------------------

// Blocks of `lanes` destination elements (16 bytes of the intermediate
// type) whose tap-0 values lie within `windows` consecutive 16-byte windows
// of the intermediate row starting at base.  Masks and weights are laid out
// by groups of `group` blocks (one register): group, then window (or tap),
// then block.
struct GatherPlan {
    int blocks = 0;           // whole groups of blocks; the elements after them go the scalar way
    int windows = 0;          // 0: no plan
    int group = 1;            // blocks per register
    int32_t* base = nullptr;  // per block: intermediate element of the first window
    uint8_t* masks = nullptr; // per block and window: 16 shuffle indices
    uint8_t* weights = nullptr;  // per block and tap: the lanes' weights (16 bytes)
};

constexpr int kMaxWindows = 4;

// Blocks per register of the columns pass, for an arithmetic whose wide
// pass gains up to registers of `bytes` bytes.  A wide register assembles
// its blocks with a load each, which gains where a block has at most three
// taps; more taps, or four loads per register of 16-bit lanes, cost more
// than the wider arithmetic saves.
constexpr int groupOf(int bytes) { return (ZOR_WIDTH < bytes ? ZOR_WIDTH : bytes) / 16; }
inline int gatherGroup(int taps, int bytes) { return taps <= 3 ? groupOf(bytes) : 1; }

// Where block b's 16 bytes for window (or tap) w lie in the plan's masks
// (or weights) with n windows (or taps) per block.
inline size_t planEntry(int b, int w, int n, int group) {
    return ((size_t(b / group) * n + w) * group + b % group) * 16;
}

// Intermediate element read by tap 0 of destination element e.
template <class W>
inline ptrdiff_t tapZero(const AxisTable<W>& x, int channels, ptrdiff_t e) {
    return ptrdiff_t(x.first[e / channels] - x.lo) * channels + e % channels;
}

// Windows the blocks need (0 when more than kMaxWindows).
template <class W>
int gatherWindows(const AxisTable<W>& x, int channels, int width, int lanes) {
    const ptrdiff_t blocks = ptrdiff_t(width) * channels / lanes;
    ptrdiff_t widest = 0;
    for (ptrdiff_t b = 0; b < blocks; ++b) {
        ptrdiff_t lo = tapZero(x, channels, b * lanes), hi = lo;
        for (int l = 1; l < lanes; ++l) {
            const ptrdiff_t t = tapZero(x, channels, b * lanes + l);
            lo = t < lo ? t : lo;
            hi = t > hi ? t : hi;
        }
        if (hi - lo + 1 > widest) widest = hi - lo + 1;
    }
    const ptrdiff_t windows = (widest + lanes - 1) / lanes;
    return blocks == 0 || windows > kMaxWindows ? 0 : int(windows);
}

// Fills a plan sized for `windows` (weights: the table's, lane by lane).
template <class W>
void fillGatherPlan(GatherPlan& g, const AxisTable<W>& x, int channels, int width, int lanes, int windows,
                    int wideBytes) {
    const int laneBytes = 16 / lanes;
    g.windows = windows;
    g.group = gatherGroup(x.taps, wideBytes);
    g.blocks = int(ptrdiff_t(width) * channels / lanes / g.group * g.group);
    for (int b = 0; b < g.blocks; ++b) {
        ptrdiff_t base = tapZero(x, channels, ptrdiff_t(b) * lanes);
        for (int l = 1; l < lanes; ++l) {
            const ptrdiff_t t = tapZero(x, channels, ptrdiff_t(b) * lanes + l);
            base = t < base ? t : base;
        }
        g.base[b] = int32_t(base);
        for (int w = 0; w < windows; ++w) {
            uint8_t* m = g.masks + planEntry(b, w, windows, g.group);
            for (int l = 0; l < lanes; ++l) {
                const ptrdiff_t at = tapZero(x, channels, ptrdiff_t(b) * lanes + l) - base - ptrdiff_t(w) * lanes;
                for (int j = 0; j < laneBytes; ++j)
                    m[l * laneBytes + j] = at >= 0 && at < lanes ? uint8_t(at * laneBytes + j) : 0x80;
            }
        }
        for (int k = 0; k < x.taps; ++k) {
            W* lw = reinterpret_cast<W*>(g.weights + planEntry(b, k, x.taps, g.group));
            for (int l = 0; l < lanes; ++l) lw[l] = x.weights(int((ptrdiff_t(b) * lanes + l) / channels))[k];
        }
    }
}

// Calls body(std::integral_constant<int, N>()) with N the tap count where it
// is one of the kernels' (2, 4, 6), so that loops over taps unroll, else 0.
template <class Body>
inline void withTaps(int n, Body body) {
    switch (n) {
    case 2: body(std::integral_constant<int, 2>()); break;
    case 4: body(std::integral_constant<int, 4>()); break;
    case 6: body(std::integral_constant<int, 6>()); break;
    default: body(std::integral_constant<int, 0>()); break;
    }
}

constexpr int kGatherTaps = 8;  // the widest uniform tables (gathered columns, fixed point)

// ---- fixed point -----------------------------------------------------------------

struct FixedPoint {
    using Weight = int16_t;
    using Inter = int16_t;  // levels in 1/64
    template <class T>
    static constexpr bool kGathers = true;
    static constexpr int kWideGatherBytes = 32;
    static Weight weight(double w) { return fixedWeight(w); }

    static void rows(const uint8_t* const* rows, const int16_t* w, int n, ptrdiff_t len, int16_t* out) {
        ptrdiff_t e = 0;
#if ZOR_SIMD >= 2
        // 16-byte registers at every width: the pass waits on the source
        // rows, and wider registers measured no faster (slower at 64 bytes).
        using B = simd::Vec<uint8_t, 16>;
        using H = simd::Vec<int16_t, 16>;
        H wv[kGatherTaps];
        for (int k = 0; k < n; ++k) wv[k] = simd::set1<H>(w[k]);
        withTaps(n, [&](auto count) {
            const int taps = count ? int(count) : n;
            for (; e + B::kLanes <= len; e += B::kLanes) {
                H lo = simd::zero<H>(), hi = simd::zero<H>();
                for (int k = 0; k < taps; ++k) {
                    const B v = simd::load<B>(rows[k] + e);
                    lo += simd::mulHiRound(simd::shl<7>(simd::bitcast<int16_t>(simd::widenLo(v))), wv[k]);
                    hi += simd::mulHiRound(simd::shl<7>(simd::bitcast<int16_t>(simd::widenHi(v))), wv[k]);
                }
                simd::store(out + e, lo);
                simd::store(out + e + H::kLanes, hi);
            }
        });
#endif
        for (; e < len; ++e) {
            int acc = 0;
            for (int k = 0; k < n; ++k) acc += simd::mulHiRound(int16_t(rows[k][e] << 7), w[k]);
            out[e] = int16_t(acc);
        }
    }
    template <class T>
    static T column(const int16_t* p, int channels, const int16_t* w, int n) {
        int acc = 0;
        for (int k = 0; k < n; ++k) acc += simd::mulHiRound(p[k * channels], w[k]);
        acc = (acc + 16) >> 5;
        return T(acc < 0 ? 0 : acc > 255 ? 255 : acc);
    }
#if ZOR_SIMD >= 4
    // The columns pass in registers of B bytes.
    template <int B>
    using Lanes = simd::Vec<int16_t, B>;
    template <class V>
    static V first(V v, V w) { return simd::mulHiRound(v, w); }
    template <class V>
    static V next(V acc, V v, V w) { return acc + simd::mulHiRound(v, w); }
    template <class V>
    static V levels(V acc) { return simd::shr<5>(acc + simd::set1<V>(16)); }
    // Two registers of results, then a lone last one.
    template <class T, class V>
    static void store2(T* out, V a, V b) {
        simd::store(out, simd::narrowSatInOrder<uint8_t>(levels(a), levels(b)));
    }
    template <class T, class V>
    static void store1(T* out, V a) {
        simd::storeHalf(out, simd::narrowSatInOrder<uint8_t>(levels(a), levels(a)));
    }
#endif
};

// ---- float -------------------------------------------------------------------------

// A float or double sum as a destination element: integers rounded half
// up and saturated (the addition rounded as F even on x87).
template <class T, class F>
inline T resultOf(F v) {
    if constexpr (std::is_same_v<T, float>) {
        return toFloat(v);
    } else {
        constexpr F top = std::is_same_v<T, uint8_t> ? 255 : 65535;
        v = v > 0 ? v : 0;
        v = v < top ? v : top;
        const F half = v + F(0.5);
        return T(int(std::is_same_v<F, float> ? toFloat(half) : toDouble(half)));
    }
}

struct FloatPoint {
    using Weight = float;
    using Inter = float;
    template <class T>
    static constexpr bool kGathers = !std::is_same_v<T, uint8_t>;
    static constexpr int kWideGatherBytes = 64;
    static Weight weight(double w) { return toFloat(w); }

    template <class T>
    static void rows(const T* const* rows, const float* w, int n, ptrdiff_t len, float* out) {
        ptrdiff_t e = 0;
#if ZOR_SIMD >= 1
        using F = simd::Vec<float>;
        if constexpr (std::is_same_v<T, float> || simd::kHas<uint16_t>) {
            const ptrdiff_t whole = len / (2 * F::kLanes) * (2 * F::kLanes);
            if (n <= kGatherTaps) {
                F wv[kGatherTaps];
                for (int k = 0; k < n; ++k) wv[k] = simd::set1<F>(w[k]);
                withTaps(n, [&](auto count) {
                    const int taps = count ? int(count) : n;
                    for (ptrdiff_t i = 0; i < whole; i += 2 * F::kLanes) {
                        F a, b, pa, pb;
                        lanes(rows[0] + i, pa, pb);
                        a = wv[0] * pa;
                        b = wv[0] * pb;
                        for (int k = 1; k < taps; ++k) {
                            lanes(rows[k] + i, pa, pb);
                            a += wv[k] * pa;
                            b += wv[k] * pb;
                        }
                        simd::store(out + i, a);
                        simd::store(out + i + F::kLanes, b);
                    }
                });
            } else {
                // Wide footprints one source row at a time (the same sums).
                for (int k = 0; k < n; ++k) {
                    const F wk = simd::set1<F>(w[k]);
                    for (ptrdiff_t i = 0; i < whole; i += 2 * F::kLanes) {
                        F pa, pb;
                        lanes(rows[k] + i, pa, pb);
                        const F a = wk * pa, b = wk * pb;
                        simd::store(out + i, k ? simd::load<F>(out + i) + a : a);
                        simd::store(out + i + F::kLanes, k ? simd::load<F>(out + i + F::kLanes) + b : b);
                    }
                }
            }
            e = whole;
        }
#endif
        for (; e < len; ++e) {
            float acc = toFloat(w[0] * float(rows[0][e]));
            for (int k = 1; k < n; ++k) acc = toFloat(acc + toFloat(w[k] * float(rows[k][e])));
            out[e] = acc;
        }
    }
#if ZOR_SIMD >= 1
    using Row = simd::Vec<float>;
    // Two registers of source elements as floats.
    static void lanes(const float* p, Row& a, Row& b) {
        a = simd::load<Row>(p);
        b = simd::load<Row>(p + Row::kLanes);
    }
#  if ZOR_SIMD >= 2
    static void lanes(const uint16_t* p, Row& a, Row& b) {
        const auto v = simd::load<simd::Vec<uint16_t>>(p);
        a = simd::toFloat(simd::bitcast<int32_t>(simd::widenLoInOrder(v)));
        b = simd::toFloat(simd::bitcast<int32_t>(simd::widenHiInOrder(v)));
    }
    static void lanes(const uint8_t* p, Row& a, Row& b) {
        const auto v = simd::loadWidened<simd::Vec<uint16_t>>(p);
        a = simd::toFloat(simd::bitcast<int32_t>(simd::widenLoInOrder(v)));
        b = simd::toFloat(simd::bitcast<int32_t>(simd::widenHiInOrder(v)));
    }
#  endif
#endif
    template <class T>
    static T column(const float* p, int channels, const float* w, int n) {
        float acc = toFloat(w[0] * p[0]);
        for (int k = 1; k < n; ++k) acc = toFloat(acc + toFloat(w[k] * p[k * channels]));
        return resultOf<T>(acc);
    }
#if ZOR_SIMD >= 4
    template <int B>
    using Lanes = simd::Vec<float, B>;
    template <class V>
    static V first(V v, V w) { return v * w; }
    template <class V>
    static V next(V acc, V v, V w) { return acc + v * w; }
    template <class V>
    static auto levels(V acc) {
        const V v = simd::min(simd::max(acc, simd::zero<V>()), simd::set1<V>(65535.0f));
        return simd::toInt32Trunc(v + simd::set1<V>(0.5f));
    }
    template <class T, class V>
    static void store2(T* out, V a, V b) {
        if constexpr (std::is_same_v<T, float>) {
            simd::store(out, a);
            simd::store(out + V::kLanes, b);
        } else {
            simd::store(out, simd::narrowSatInOrder<uint16_t>(levels(a), levels(b)));
        }
    }
    template <class T, class V>
    static void store1(T* out, V a) {
        if constexpr (std::is_same_v<T, float>) simd::store(out, a);
        else simd::storeHalf(out, simd::narrowSatInOrder<uint16_t>(levels(a), levels(a)));
    }
#endif
};

// ---- double --------------------------------------------------------------------------

struct DoublePoint {
    using Weight = double;
    using Inter = double;
    template <class T>
    static constexpr bool kGathers = false;
    static constexpr int kWideGatherBytes = 16;
    static Weight weight(double w) { return w; }

    template <class T>
    static void rows(const T* const* rows, const double* w, int n, ptrdiff_t len, double* out) {
        ptrdiff_t e = 0;
#if ZOR_SIMD >= 2
        // One source row at a time over blocks of 8 elements (the same sums),
        // in 16-byte registers at every width.
        using D = simd::Vec<double, 16>;
        static_assert(D::kLanes == 2, "blocks of 8 elements in 4 registers");
        const ptrdiff_t whole = len / 8 * 8;
        for (int k = 0; k < n; ++k) {
            const D wk = simd::set1<D>(w[k]);
            for (ptrdiff_t i = 0; i < whole; i += 8) {
                D v[4];
                lanes(rows[k] + i, v);
                for (int r = 0; r < 4; ++r) {
                    double* o = out + i + 2 * r;
                    simd::store(o, k ? simd::load<D>(o) + wk * v[r] : wk * v[r]);
                }
            }
        }
        e = whole;
#endif
        for (; e < len; ++e) {
            double acc = toDouble(w[0] * double(rows[0][e]));
            for (int k = 1; k < n; ++k) acc = toDouble(acc + toDouble(w[k] * double(rows[k][e])));
            out[e] = acc;
        }
    }
    template <class T>
    static T column(const double* p, int channels, const double* w, int n) {
        double acc = toDouble(w[0] * p[0]);
        for (int k = 1; k < n; ++k) acc = toDouble(acc + toDouble(w[k] * p[k * channels]));
        return resultOf<T>(acc);
    }
#if ZOR_SIMD >= 2
    // Eight source elements as doubles.
    static void lanes(const float* p, simd::Vec<double, 16> (&v)[4]) {
        for (int h = 0; h < 2; ++h) {
            const auto f = simd::load<simd::Vec<float, 16>>(p + 4 * h);
            v[2 * h] = simd::widenLo(f);
            v[2 * h + 1] = simd::widenHi(f);
        }
    }
    template <class U>
    static void lanes(const U* p, simd::Vec<double, 16> (&v)[4]) {
        simd::Vec<uint16_t, 16> u;
        if constexpr (sizeof(U) == 1) u = simd::widenLo(simd::loadHalf<simd::Vec<uint8_t, 16>>(p));
        else u = simd::load<simd::Vec<uint16_t, 16>>(p);
        const auto lo = simd::bitcast<int32_t>(simd::widenLo(u)), hi = simd::bitcast<int32_t>(simd::widenHi(u));
        v[0] = simd::toDoubleLo(lo);
        v[1] = simd::toDoubleHi(lo);
        v[2] = simd::toDoubleLo(hi);
        v[3] = simd::toDoubleHi(hi);
    }
#endif
};

// ---- the columns pass ------------------------------------------------------------------

// Destination elements [from, to) the scalar way.
template <class A, class T>
void columnsScalar(const typename A::Inter* in, const AxisTable<typename A::Weight>& x, int channels,
                   ptrdiff_t from, ptrdiff_t to, T* out) {
    for (ptrdiff_t e = from; e < to; ++e) {
        const int i = int(e / channels);
        out[e] = A::template column<T>(in + tapZero(x, channels, e), channels, x.weights(i), x.count(i));
    }
}

#if ZOR_SIMD >= 4
// The register of blocks from block b on (Bytes / 16 of them): per tap,
// its lanes shuffled out of the windows, weighted and summed.  (A call per
// register would cost as much as the register.)
template <class A, int Windows, int Bytes>
[[gnu::always_inline]] inline auto gatheredBlock(const typename A::Inter* in, const GatherPlan& g, int b, int taps,
                                                 int channels) {
    using L = typename A::template Lanes<Bytes>;
    using B = simd::Vec<uint8_t, Bytes>;
    constexpr int blockLanes = 16 / int(sizeof(typename A::Inter)), group = Bytes / 16;
    const typename A::Inter* at[group];  // the blocks' first windows
    for (int j = 0; j < group; ++j) at[j] = in + g.base[b + j];
    B masks[Windows];
    for (int w = 0; w < Windows; ++w) masks[w] = simd::load<B>(g.masks + planEntry(b, w, Windows, group));
    // The register's weights, a register per tap.
    const auto* weights = reinterpret_cast<const typename A::Weight*>(g.weights + planEntry(b, 0, taps, group));
    L acc;
    for (int k = 0; k < taps; ++k) {
        const typename A::Inter* q[group];
        for (int j = 0; j < group; ++j) q[j] = at[j] + k * channels;
        B v = simd::shuffleBytes(simd::bitcast<uint8_t>(simd::loadBlocksAt<L>(q, 0)), masks[0]);
        for (int w = 1; w < Windows; ++w)
            v = v | simd::shuffleBytes(simd::bitcast<uint8_t>(simd::loadBlocksAt<L>(q, w * blockLanes)), masks[w]);
        const L x = simd::bitcast<typename L::Lane>(v);
        const L wk = simd::load<L>(weights + k * L::kLanes);
        acc = k ? A::next(acc, x, wk) : A::first(x, wk);
    }
    return acc;
}

// Whole registers of blocks, two at a time.  Taps is the tap count where it
// is a constant (else 0: taps).
template <class A, int Windows, int Bytes, int Taps, class T>
void columnsGathered(const typename A::Inter* in, const GatherPlan& plan, int taps, int channels, T* out) {
    constexpr int blockLanes = 16 / int(sizeof(typename A::Inter)), group = Bytes / 16;
    const GatherPlan g = plan;  // a copy the stores to out cannot alias
    const int m = Taps ? Taps : taps;
    int b = 0;
    for (; b + 2 * group <= g.blocks; b += 2 * group) {
        const auto first = gatheredBlock<A, Windows, Bytes>(in, g, b, m, channels);
        A::template store2<T>(out + ptrdiff_t(b) * blockLanes, first,
                              gatheredBlock<A, Windows, Bytes>(in, g, b + group, m, channels));
    }
    if (b < g.blocks)
        A::template store1<T>(out + ptrdiff_t(b) * blockLanes, gatheredBlock<A, Windows, Bytes>(in, g, b, m, channels));
}

template <class A, int Windows, class T>
void columnsGathered(const typename A::Inter* in, const GatherPlan& g, int taps, int channels, T* out) {
    withTaps(taps, [&](auto count) {
        constexpr int n = decltype(count)::value, group = groupOf(A::kWideGatherBytes);
        if (group > 1 && g.group == group) columnsGathered<A, Windows, 16 * group, n>(in, g, taps, channels, out);
        else columnsGathered<A, Windows, 16, n>(in, g, taps, channels, out);
    });
}
#endif

// A destination row from the intermediate row.
template <class A, class T>
void columns(const typename A::Inter* in, const AxisTable<typename A::Weight>& x, const GatherPlan& g, int channels,
             int width, T* out) {
    ptrdiff_t done = 0;
    (void)g;  // a plan exists from SSSE3 on
#if ZOR_SIMD >= 4
    if constexpr (A::template kGathers<T>) {
        switch (g.windows) {
        case 1: columnsGathered<A, 1>(in, g, x.taps, channels, out); break;
        case 2: columnsGathered<A, 2>(in, g, x.taps, channels, out); break;
        case 3: columnsGathered<A, 3>(in, g, x.taps, channels, out); break;
        case 4: columnsGathered<A, 4>(in, g, x.taps, channels, out); break;
        default: break;
        }
        if (g.windows) done = ptrdiff_t(g.blocks) * (16 / sizeof(typename A::Inter));
    }
#endif
    columnsScalar<A>(in, x, channels, done, ptrdiff_t(width) * channels, out);
}

// ---- 2 x 2 averages ---------------------------------------------------------------

// out[i] = (r0[2i] + r0[2i + 1] + r1[2i] + r1[2i + 1] + 2) >> 2.
inline void average2x2(const uint8_t* r0, const uint8_t* r1, uint8_t* out, int width) {
    int i = 0;
#if ZOR_SIMD >= 2
    // 16-byte registers at every width: bound by memory, and wider ones
    // measured slower.
    using B = simd::Vec<uint8_t, 16>;
    using U = simd::Vec<uint16_t, 16>;
    const auto pairs = [](B v) {
#  if ZOR_SIMD >= 4
        return simd::bitcast<uint16_t>(simd::mulAddPairs(v, simd::set1<simd::Vec<int8_t, 16>>(1)));
#  else
        const U u = simd::bitcast<uint16_t>(v);
        return (u & simd::set1<U>(0xFF)) + simd::shr<8>(u);
#  endif
    };
    const U two = simd::set1<U>(2);
    for (; i + B::kLanes <= width; i += B::kLanes) {
        const U lo = pairs(simd::load<B>(r0 + 2 * i)) + pairs(simd::load<B>(r1 + 2 * i));
        const U hi = pairs(simd::load<B>(r0 + 2 * i + B::kLanes)) + pairs(simd::load<B>(r1 + 2 * i + B::kLanes));
        simd::store(out + i, simd::narrowSat<uint8_t>(simd::shr<2>(lo + two), simd::shr<2>(hi + two)));
    }
#endif
    for (; i < width; ++i) out[i] = uint8_t((r0[2 * i] + r0[2 * i + 1] + r1[2 * i] + r1[2 * i + 1] + 2) >> 2);
}

}}}  // namespace zor::ZOR_NS::(anonymous)
