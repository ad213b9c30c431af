// Row kernels of the image reductions (image/stats/reductions.cpp): each
// works on one row and gives that row's exact result, so the exports only
// have to combine rows in their documented order.  Generic code first in
// each kernel, the lane-vocabulary path beside it (SSE2 and up for integer
// lanes, SSE and up for floats).
//
// Three-channel rows are read as runs of three registers: lane k of
// register r of a run holds channel (r * kLanes + k) % 3 at every register
// width.  channelLabels() builds those channel numbers as a register, and
// because labels go through the same widening as the data, a fold by label
// (foldByChannel) is right whatever the lanes went through.
//
// Include after frame/variant.h.
#pragma once

#include "frame/simd.h"

#include <cstddef>
#include <cstdint>

namespace zor { namespace ZOR_NS {
namespace {

// ---- three-channel helpers -----------------------------------------------------

template <class V>
V channelLabels(int r) {
    using T = typename V::Lane;
    alignas(64) T l[V::kLanes];
    for (int k = 0; k < V::kLanes; ++k) l[k] = T((r * V::kLanes + k) % 3);
    return simd::loadAligned<V>(l);
}

// Channel c of a run of three registers, gathered into one: lane k of
// register r holds channel (r kLanes + k) mod 3, and as kLanes is no
// multiple of 3 every lane position holds channel c in exactly one of the
// three registers.  Fewer live registers than keeping the three apart,
// which the eight registers of the 32-bit build need.
template <class V>
class ChannelGather {
public:
    explicit ChannelGather(int c) {
        using T = typename V::Lane;
        for (int r = 0; r < 3; ++r) mask_[r] = simd::eq(channelLabels<V>(r), simd::set1<V>(T(c)));
    }
    V operator()(const typename V::Lane* run) const {
        constexpr int L = V::kLanes;
        return (simd::load<V>(run) & mask_[0]) | (simd::load<V>(run + L) & mask_[1]) |
               (simd::load<V>(run + 2 * L) & mask_[2]);
    }

private:
    V mask_[3];
};

// out[label of lane k] = op(out[...], lane k) for every lane.
template <class T, int B, class Acc, class Op>
void foldByChannel(simd::Vec<T, B> values, simd::Vec<T, B> labels, Acc* out, Op op) {
    constexpr int L = simd::Vec<T, B>::kLanes;
    alignas(64) T v[L], l[L];
    simd::storeAligned(v, values);
    simd::storeAligned(l, labels);
    for (int k = 0; k < L; ++k) out[l[k]] = op(out[l[k]], v[k]);
}

const auto addTo = [](auto a, auto b) { return decltype(a)(a + b); };
const auto minOf = [](auto a, auto b) { return decltype(a)(b < a ? b : a); };
const auto maxOf = [](auto a, auto b) { return decltype(a)(b > a ? b : a); };

// ---- 8-bit sums: plain and of absolute differences ----------------------------

// Sum of a[x] (Diff false) or of |a[x] - b[x]| (Diff true) over rows, exact
// in 64 bits.  Generic: two partial sums over the even and odd columns, the
// last odd column added to the even one.  SIMD: sums of 8-byte groups in
// 64-bit lanes, kept across rows.
template <bool Diff>
class ByteSum {
public:
    void addRow(const uint8_t* a, const uint8_t* b, int n) {
        int x = 0;
#if ZOR_SIMD >= 2
        auto sad = [&](int at) {
            return simd::sumAbsDiff(simd::load<V>(a + at), Diff ? simd::load<V>(b + at) : simd::zero<V>());
        };
        for (; x + 4 * L <= n; x += 4 * L) {
            s_[0] += sad(x);
            s_[1] += sad(x + L);
            s_[2] += sad(x + 2 * L);
            s_[3] += sad(x + 3 * L);
        }
        for (; x + L <= n; x += L) s_[0] += sad(x);
#endif
        auto at = [&](int i) -> uint64_t {
            if constexpr (Diff) return simd::absDiff(a[i], b[i]);
            else return a[i];
        };
        for (; x + 2 <= n; x += 2) {
            even_ += at(x);
            odd_ += at(x + 1);
        }
        if (x < n) even_ += at(x);
    }
    uint64_t total() const {
        uint64_t t = even_ + odd_;
#if ZOR_SIMD >= 2
        t += simd::reduceAdd((s_[0] + s_[1]) + (s_[2] + s_[3]));
#endif
        return t;
    }

private:
    uint64_t even_ = 0, odd_ = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    using W = simd::Vec<uint64_t>;
    static constexpr int L = V::kLanes;
    W s_[4] = {simd::zero<W>(), simd::zero<W>(), simd::zero<W>(), simd::zero<W>()};
#endif
};

// Per-channel sums of a three-channel 8-bit row, added to sums[3] (32-bit).
inline void rowChannelSums8u(const uint8_t* s, int w, uint32_t* sums) {
    int x = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    using H = simd::Vec<uint16_t>;
    constexpr int L = V::kLanes;  // pixels per run of three registers
    H lab[6];
    for (int r = 0; r < 3; ++r) {
        const V l = channelLabels<V>(r);
        lab[2 * r] = simd::widenLo(l);
        lab[2 * r + 1] = simd::widenHi(l);
    }
    while (x + L <= w) {
        // 16-bit lanes hold 257 * 255: fold before that many runs
        H acc[6];
        for (H& a : acc) a = simd::zero<H>();
        for (int runs = 0; runs < 256 && x + L <= w; ++runs, x += L)
            for (int r = 0; r < 3; ++r) {
                const V v = simd::load<V>(s + 3 * x + r * L);
                acc[2 * r] += simd::widenLo(v);
                acc[2 * r + 1] += simd::widenHi(v);
            }
        for (int k = 0; k < 6; ++k) foldByChannel(acc[k], lab[k], sums, addTo);
    }
#endif
    for (; x < w; ++x)
        for (int c = 0; c < 3; ++c) sums[c] += s[3 * x + c];
}

// ---- one channel of three: sum and sum of squares -------------------------------

struct SumSquares {
    int64_t sum = 0, squares = 0;
};

// Adds channel c of pixels x .. w - 1 to t.
template <class T>
SumSquares addSamples(const T* s, int x, int w, int c, SumSquares t) {
    for (; x < w; ++x) {
        const int64_t v = s[3 * x + c];
        t.sum += v;
        t.squares += v * v;
    }
    return t;
}

// Channel c of an 8-bit three-channel row.
inline SumSquares rowChannelSquares8u(const uint8_t* s, int w, int c) {
    SumSquares t;
    int x = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    using H = simd::Vec<int16_t>;
    using I = simd::Vec<int32_t>;
    using W = simd::Vec<uint64_t>;
    constexpr int L = V::kLanes;
    V mask[3];
    for (int r = 0; r < 3; ++r) mask[r] = simd::eq(channelLabels<V>(r), simd::set1<V>(uint8_t(c)));
    const V z = simd::zero<V>();
    W sum = simd::zero<W>();
    while (x + L <= w) {
        // a 32-bit lane gains at most 6 * 255^2 per run (one channel sample
        // per pair of 16-bit lanes, six half registers feeding it)
        I sq = simd::zero<I>();
        for (int runs = 0; runs < 8192 && x + L <= w; ++runs, x += L)
            for (int r = 0; r < 3; ++r) {
                const V v = simd::load<V>(s + 3 * x + r * L) & mask[r];
                sum += simd::sumAbsDiff(v, z);
                const H lo = simd::bitcast<int16_t>(simd::widenLo(v));
                const H hi = simd::bitcast<int16_t>(simd::widenHi(v));
                sq += simd::mulAddPairs(lo, lo) + simd::mulAddPairs(hi, hi);
            }
        const simd::Vec<uint32_t> u = simd::bitcast<uint32_t>(sq);
        t.squares += int64_t(simd::reduceAdd(simd::widenLo(u) + simd::widenHi(u)));
    }
    t.sum = int64_t(simd::reduceAdd(sum));
#endif
    return addSamples(s, x, w, c, t);
}

// Channel c of a 16-bit three-channel row.  The SIMD path gathers the
// channel's samples of a run into one register and works on v - 32768,
// whose squares (at most 2^30) pairs of lanes can sum, and corrects at the
// end: sum v^2 = sum (v - 32768)^2 + 65536 sum v - n 2^30.
inline SumSquares rowChannelSquares16u(const uint16_t* s, int w, int c) {
    SumSquares t;
    int x = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint16_t>;
    using H = simd::Vec<int16_t>;
    using I = simd::Vec<int32_t>;
    using U = simd::Vec<uint32_t>;
    using W = simd::Vec<uint64_t>;
    constexpr int L = V::kLanes;
    const ChannelGather<V> channel(c);
    const H bias = simd::set1<H>(int16_t(-32768)), ones = simd::set1<H>(1);
    W squares = simd::zero<W>();
    int64_t centred = 0;
    while (x + L <= w) {
        I sum = simd::zero<I>();  // at most 2 * 32768 per lane and run
        for (int runs = 0; runs < 4096 && x + L <= w; ++runs, x += L) {
            const H v = simd::bitcast<int16_t>(channel(s + 3 * x)) ^ bias;
            sum += simd::mulAddPairs(v, ones);
            const U sq = simd::bitcast<uint32_t>(simd::mulAddPairs(v, v));  // at most 2^31
            squares += simd::widenLo(sq) + simd::widenHi(sq);
        }
        centred += simd::reduceAdd(sum);
    }
    const int64_t n = x;  // the samples taken
    t.sum = centred + 32768 * n;
    t.squares = int64_t(simd::reduceAdd(squares)) + 65536 * t.sum - (n << 30);
#endif
    return addSamples(s, x, w, c, t);
}

// ---- extrema of 8-bit rows ------------------------------------------------------------

// Maximum of a row of n >= 1 bytes.
inline uint8_t rowMax8u(const uint8_t* s, int n) {
    uint8_t m = s[0];
    int x = 0;
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    constexpr int L = V::kLanes;
    if (n >= L) {
        V m0 = simd::load<V>(s), m1 = m0;
        for (x = L; x + 2 * L <= n; x += 2 * L) {
            m0 = simd::max(m0, simd::load<V>(s + x));
            m1 = simd::max(m1, simd::load<V>(s + x + L));
        }
        if (x + L <= n) m0 = simd::max(m0, simd::load<V>(s + x));
        // the last register may overlap the ones before
        m0 = simd::max(simd::max(m0, m1), simd::load<V>(s + n - L));
        return simd::reduceMax(m0);
    }
#endif
    for (; x < n; ++x) m = maxOf(m, s[x]);
    return m;
}

#if ZOR_SIMD >= 2
// Per-channel extrema of a three-channel row of w >= kLanes pixels, merged
// into mn[3] and mx[3]: lane-wise over the runs of three registers that
// at(pixel, r) loads (the last run may overlap the one before, with the same
// channel order), then folded by channel.
template <class V, class Load>
void runExtremes(int w, Load at, typename V::Lane* mn, typename V::Lane* mx) {
    constexpr int L = V::kLanes;
    V lo[3], hi[3];
    for (int r = 0; r < 3; ++r) lo[r] = hi[r] = at(0, r);
    for (int x = L;; x += L) {
        if (x + L > w) x = w - L;
        for (int r = 0; r < 3; ++r) {
            const V v = at(x, r);
            lo[r] = simd::min(lo[r], v);
            hi[r] = simd::max(hi[r], v);
        }
        if (x == w - L) break;
    }
    for (int r = 0; r < 3; ++r) {
        const V lab = channelLabels<V>(r);
        foldByChannel(lo[r], lab, mn, minOf);
        foldByChannel(hi[r], lab, mx, maxOf);
    }
}
#endif

// Per-channel minima and maxima of a three-channel 8-bit row, merged into
// mn[3] and mx[3].
inline void rowMinMax8uC3(const uint8_t* s, int w, uint8_t* mn, uint8_t* mx) {
#if ZOR_SIMD >= 2
    using V = simd::Vec<uint8_t>;
    if (w >= V::kLanes)
        return runExtremes<V>(w, [&](int px, int r) { return simd::load<V>(s + 3 * px + r * V::kLanes); }, mn, mx);
#endif
    for (int x = 0; x < w; ++x)
        for (int c = 0; c < 3; ++c) {
            mn[c] = minOf(mn[c], s[3 * x + c]);
            mx[c] = maxOf(mx[c], s[3 * x + c]);
        }
}

// ---- one channel of a 16-bit three-channel row: extrema ---------------------------------

struct Range16u {
    uint16_t min = 65535, max = 0;
};

inline Range16u rowRange16u(const uint16_t* s, int w, int c) {
    Range16u m;
#if ZOR_SIMD >= 2
    // Channel c of each run gathered into one register (a last run that
    // does not fill the registers overlaps the one before, with the same
    // channel order); unsigned order as signed order of v ^ 0x8000, where
    // the instructions are single.
    using V = simd::Vec<int16_t>;
    constexpr int L = V::kLanes;
    if (w >= L) {
        const ChannelGather<V> channel(c);
        const V flip = simd::set1<V>(int16_t(-32768));
        const int16_t* p = reinterpret_cast<const int16_t*>(s);
        V lo = channel(p) ^ flip, hi = lo;
        auto take = [&](int x) {
            const V v = channel(p + 3 * x) ^ flip;
            lo = simd::min(lo, v);
            hi = simd::max(hi, v);
        };
        int x = L;
        for (; x + L <= w; x += L) take(x);
        if (x < w) take(w - L);
        m.min = uint16_t(simd::reduceMin(lo) ^ 0x8000);
        m.max = uint16_t(simd::reduceMax(hi) ^ 0x8000);
        return m;
    }
#endif
    for (int x = 0; x < w; ++x) {
        m.min = minOf(m.min, s[3 * x + c]);
        m.max = maxOf(m.max, s[3 * x + c]);
    }
    return m;
}

// ---- float rows ------------------------------------------------------------------------

// The fast float sum of one row: 16 float partial sums (element i into
// partial i mod 16), added in double in partial order, then the last
// n mod 16 elements in double.
#if ZOR_SIMD >= 1
inline double rowSumFast32f(const float* s, int n) {
    using V = simd::Vec<float>;
    constexpr int L = V::kLanes, kRegs = 16 / L;
    V p[kRegs];
    for (V& v : p) v = simd::zero<V>();
    int x = 0;
    for (; x + 16 <= n; x += 16)
        for (int r = 0; r < kRegs; ++r) p[r] += simd::load<V>(s + x + r * L);
    alignas(64) float part[16];
    for (int r = 0; r < kRegs; ++r) simd::storeAligned(part + r * L, p[r]);
    double t = 0.0;
    for (float v : part) t += v;
    for (; x < n; ++x) t += s[x];
    return t;
}
#endif

// Extrema of a float row with every value ordered (no NaN): the vector
// lanes and the tail in m.  Returns false as soon as a NaN shows up.
struct Range32f {
    float min, max;
};
inline bool rowRange32f(const float* s, int n, Range32f& m) {
    int x = 0;
#if ZOR_SIMD >= 1
    using V = simd::Vec<float>;
    constexpr int L = V::kLanes;
    if (n >= L) {
        V lo = simd::set1<V>(m.min), hi = simd::set1<V>(m.max);
        V ordered = simd::eq(lo, lo);
        for (x = 0;; x += L) {
            if (x + L > n) x = n - L;
            const V v = simd::load<V>(s + x);
            ordered = ordered & simd::eq(v, v);
            lo = simd::min(lo, v);
            hi = simd::max(hi, v);
            if (x == n - L) break;
        }
        if (simd::laneMask(ordered) != (1 << L) - 1) return false;
        m.min = simd::reduceMin(lo);
        m.max = simd::reduceMax(hi);
        return true;
    }
#endif
    for (; x < n; ++x) {
        const float v = s[x];
        if (v != v) return false;
        m.min = minOf(m.min, v);
        m.max = maxOf(m.max, v);
    }
    return true;
}

}  // namespace
}}  // namespace zor::ZOR_NS
