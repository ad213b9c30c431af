// Kernels of the linear filters (image/filter/linear.cpp): the divisor
// modes and the rounding of float sums, the generic rows, and the SIMD row
// kernels the filters choose from, fastest first:
//   integer kernels   ByteKernel + Scale16 + PairRows (SSSE3: byte
//                     coefficients, 16-bit sums), IntKernelTable (SSE2:
//                     16-bit coefficient pairs, 32-bit sums), intRow8u;
//   float kernels     GridFloatKernel, ExactFloatKernel (8u, SSE2: exact
//                     integer sums), doubleRow (SSE2: the double loop a
//                     register of lanes at a time), floatRow.
// The SIMD kernels are written once over the lane vocabulary and run at the
// column's register width (32 and 64 bytes in the wide columns), with the
// same bits at every width.
// Included by linear.cpp only, after frame/variant.h.
#pragma once

#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/row_address.h"
#include "frame/simd.h"
#include "frame/status.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <new>

namespace zor { namespace ZOR_NS {
namespace {

// ---- the divisor -------------------------------------------------------------

// Mode 0: divisor 1.  Mode 1: divisor 2^shift (shift >= 1).  Mode 2: any
// other divisor, through factor = (float)(1.0 / divisor).  The divisor
// -2147483648 looks like a power of two to the classic bit test
// ((d - 1) & (d | signbit)) == 0 but has no shift count: it is deliberately
// treated as mode 2, so the result is round-half-up(sum * -2^-31) for
// negative sums (1 for sums <= -2^30) and 0 otherwise.
struct DivisorScaling {
    int mode;
    int shift;
    float factor;
    // factor = mant * 2^-exp exactly, mant a signed integer below 2^24 in
    // magnitude: mode 2 results are computed exactly in 64-bit integers.
    int64_t mant;
    int exp;
};

DivisorScaling divisorScaling(int32_t divisor) {
    DivisorScaling d{};
    if (divisor == 1) {
        d.mode = 0;
    } else if (divisor > 1 && (divisor & (divisor - 1)) == 0) {
        d.mode = 1;
        while ((int32_t(1) << d.shift) != divisor) ++d.shift;
    } else {
        d.mode = 2;
        d.factor = toFloat(1.0 / static_cast<double>(divisor));
        int e = 0;
        const double m = std::frexp(static_cast<double>(d.factor), &e);  // |m| in [0.5, 1)
        d.mant = static_cast<int64_t>(std::ldexp(m, 24));                 // exact: 24-bit mantissa
        d.exp = 24 - e;                                                   // 23 .. 55
    }
    return d;
}

// The 8u result of an integer sum.
inline uint8_t scaleSum8u(int32_t s, const DivisorScaling& d) {
    switch (d.mode) {
    case 0:
        return saturate<uint8_t>(s);
    case 1: {
        if (s < 1) return 0;
        // (s + 2^(shift-1)) >> shift, without the addition overflowing
        const int32_t q = (s >> d.shift) + ((s >> (d.shift - 1)) & 1);
        return q > 255 ? 255 : static_cast<uint8_t>(q);
    }
    default: {
        // s * factor + 0.5 truncated, for positive products only: with
        // factor = mant * 2^-exp that is (2|s||mant| + 2^exp) >> (exp + 1),
        // exact in 64 bits (|s| <= 2^31, |mant| < 2^24, exp <= 55).
        if (s == 0 || ((s < 0) != (d.mant < 0))) return 0;
        const int64_t as = s < 0 ? -static_cast<int64_t>(s) : s;
        const int64_t am = d.mant < 0 ? -d.mant : d.mant;
        const int64_t q = (2 * as * am + (int64_t(1) << d.exp)) >> (d.exp + 1);
        return q > 255 ? 255 : static_cast<uint8_t>(q);
    }
    }
}

// ---- float results -----------------------------------------------------------

inline uint8_t roundSum8u(double s) {
    if (s > 0) s = toDouble(s + 0.5);
    if (s > 255.0) return 255;
    if (!(s >= 0.0)) return 0;  // negative or NaN
    return static_cast<uint8_t>(static_cast<int>(s));
}

// Half away from zero; NaN gives 0.
inline int16_t roundSum16s(double s) {
    if (s > 0) s = toDouble(s + 0.5);
    if (s < 0) s = toDouble(s - 0.5);
    if (s > 32767.0) return 32767;
    if (s < -32768.0) return -32768;
    if (s != s) return 0;
    return static_cast<int16_t>(static_cast<int>(s));
}

// ---- generic rows ------------------------------------------------------------

// One output row of the integer 8u filter, samples [from, to).
void intRow8u(const uint8_t* top, int srcStep, uint8_t* dst, int from, int to,
              const int32_t* kernel, ImageSize ks, int channels, const DivisorScaling& d) {
    const int n = ks.width * ks.height;
    for (int x = from; x < to; ++x) {
        uint32_t s = 0;  // wraps like 32-bit integer arithmetic
        for (int r = 0; r < ks.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const int32_t* k = kernel + n - 1 - r * ks.width;  // K[kH-1-r][kW-1]
            for (int q = 0; q < ks.width; ++q)
                s += static_cast<uint32_t>(p[q * channels]) * static_cast<uint32_t>(k[-q]);
        }
        dst[x] = scaleSum8u(static_cast<int32_t>(s), d);
    }
}

template <class T, class Out>
void floatRow(const T* top, int srcStep, Out* dst, int from, int to, const float* kernel,
              ImageSize ks, int channels) {
    const int n = ks.width * ks.height;
    for (int x = from; x < to; ++x) {
        double s = 0.0;
        for (int r = 0; r < ks.height; ++r) {
            const T* p = rowAt(top, srcStep, r) + x;
            const float* k = kernel + n - 1 - r * ks.width;
            for (int q = 0; q < ks.width; ++q)
                s = toDouble(s + static_cast<double>(p[q * channels]) * static_cast<double>(k[-q]));
        }
        if constexpr (sizeof(Out) == 1)
            dst[x] = roundSum8u(s);
        else
            dst[x] = roundSum16s(s);
    }
}

// ---- SIMD rows -----------------------------------------------------------------

#if ZOR_SIMD >= 2
// The SIMD rows compute one register of byte results (four of 32-bit sums)
// at a time, at B bytes a register: the column's width (wider in the wide
// columns) or 16 bytes for rows shorter than that (widthFor in linear.cpp).
// Every result is formed lane by lane, so the width changes no bit.  The
// coefficient tables hold 16-byte blocks, broadcast to every block of a
// wider register (loadBlocks with stride 0).
template <int B>
using U8s = simd::Vec<uint8_t, B>;
template <int B>
using I16s = simd::Vec<int16_t, B>;
template <int B>
using I32s = simd::Vec<int32_t, B>;
template <int B>
using Ds = simd::Vec<double, B>;
using I16x8 = I16s<16>;

// Per 16-byte block: the four registers of 32-bit sums that widenLo/widenHi
// and zipLo/zipHi made from one register of bytes, narrowed and saturated
// back to bytes in the bytes' order.
template <int B>
inline U8s<B> packBytes(const I32s<B> (&v)[4]) {
    using simd::narrowSat;
    return narrowSat<uint8_t>(narrowSat<int16_t>(v[0], v[1]), narrowSat<int16_t>(v[2], v[3]));
}
// The same of sums held in the lanes' order (v[0] the first quarter).
template <int B>
inline U8s<B> packBytesInOrder(const I32s<B> (&v)[4]) {
    using simd::narrowSatInOrder;
    return narrowSatInOrder<uint8_t>(narrowSatInOrder<int16_t>(v[0], v[1]), narrowSatInOrder<int16_t>(v[2], v[3]));
}
// Coefficients c0 (low) and c1 (high) as 16-bit pairs in every 32-bit lane.
template <int B = 16>
inline I16s<B> coefficientPairs(int32_t c0, int32_t c1) {
    return simd::bitcast<int16_t>(simd::set1<I32s<B>>(
        static_cast<int32_t>((static_cast<uint32_t>(c1) << 16) | (static_cast<uint32_t>(c0) & 0xFFFFu))));
}

// Integer kernel, 16 output samples at a time: the reversed kernel as 16-bit
// coefficient pairs, products summed pairwise by pmaddwd into 32-bit lanes
// that wrap exactly like the scalar sum.
class IntKernelTable {
public:
    IntKernelTable(const int32_t* kernel, ImageSize ks) : ks_(ks) {
        pairs_ = (ks.width + 1) / 2;
        for (int i = 0; i < ks.width * ks.height; ++i)
            if (kernel[i] < -32767 || kernel[i] > 32766) return;  // no 16-bit table then
        const uint32_t count = static_cast<uint32_t>(pairs_) * static_cast<uint32_t>(ks.height);
        if (uint64_t(count) * sizeof(I16x8) > 0x7FFFFFFFu) return;
        table_ = static_cast<I16x8*>(mem::alignedAlloc(count * sizeof(I16x8)));
        if (!table_) return;
        const int n = ks.width * ks.height;
        for (int r = 0; r < ks.height; ++r)
            for (int p = 0; p < pairs_; ++p) {
                const int q = 2 * p;
                const int32_t c0 = kernel[n - 1 - r * ks.width - q];
                const int32_t c1 = q + 1 < ks.width ? kernel[n - 1 - r * ks.width - q - 1] : 0;
                table_[r * pairs_ + p] = coefficientPairs(c0, c1);
            }
    }
    ~IntKernelTable() { mem::alignedFree(table_); }
    IntKernelTable(const IntKernelTable&) = delete;
    IntKernelTable& operator=(const IntKernelTable&) = delete;
    bool ok() const { return table_ != nullptr; }

    // The register of samples at p of kernel columns q and q + 1 (0 past the
    // kernel's width) as four vectors of 16-bit pairs, ready for pmaddwd.
    template <int B>
    void columnPairs(const uint8_t* p, int q, int channels, I16s<B> v[4]) const {
        using namespace simd;
        const U8s<B> a = load<U8s<B>>(p + q * channels);
        const U8s<B> b = q + 1 < ks_.width ? load<U8s<B>>(p + (q + 1) * channels) : zero<U8s<B>>();
        const auto alo = widenLo(a), ahi = widenHi(a), blo = widenLo(b), bhi = widenHi(b);
        v[0] = bitcast<int16_t>(zipLo(alo, blo));
        v[1] = bitcast<int16_t>(zipHi(alo, blo));
        v[2] = bitcast<int16_t>(zipLo(ahi, bhi));
        v[3] = bitcast<int16_t>(zipHi(ahi, bhi));
    }

    // Sums of a register of output samples starting at sample x.
    template <int B>
    void sums(const uint8_t* top, int srcStep, int x, int channels, I32s<B> acc[4]) const {
        for (int i = 0; i < 4; ++i) acc[i] = simd::zero<I32s<B>>();
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const I16x8* t = table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                I16s<B> v[4];
                columnPairs<B>(p, 2 * k, channels, v);
                const I16s<B> tk = coefficients<B>(t + k);
                for (int i = 0; i < 4; ++i) acc[i] = acc[i] + simd::mulAddPairs(v[i], tk);
            }
        }
    }

    // Sums of two kernels of the same shape over the same pixels (each pixel
    // pair unpacked once).
    template <int B>
    void sums2(const IntKernelTable& other, const uint8_t* top, int srcStep, int x, int channels,
               I32s<B> acc[4], I32s<B> acc2[4]) const {
        using simd::mulAddPairs;
        for (int i = 0; i < 4; ++i) acc[i] = acc2[i] = simd::zero<I32s<B>>();
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const I16x8* t = table_ + r * pairs_;
            const I16x8* t2 = other.table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                I16s<B> v[4];
                columnPairs<B>(p, 2 * k, channels, v);
                const I16s<B> tk = coefficients<B>(t + k), tk2 = coefficients<B>(t2 + k);
                for (int i = 0; i < 4; ++i) {
                    acc[i] = acc[i] + mulAddPairs(v[i], tk);
                    acc2[i] = acc2[i] + mulAddPairs(v[i], tk2);
                }
            }
        }
    }

    // A table entry in every 16-byte block of a register (at 16 bytes the
    // aligned entry itself, which instructions can take as an operand).
    template <int B>
    static I16s<B> coefficients(const I16x8* entry) {
        if constexpr (B == 16) return *entry;
        else return simd::loadBlocks<I16s<B>>(reinterpret_cast<const int16_t*>(entry), 0);
    }

private:
    ImageSize ks_;
    int pairs_ = 0;
    I16x8* table_ = nullptr;
};

// Mode 2 in double: exact when |sum| * |mant| < 2^53 and sum * factor + 0.5
// needs no rounding below 256 (exp <= 44).
template <int B>
inline I32s<B> scaleDouble(I32s<B> s, Ds<B> f) {
    using namespace simd;
    const Ds<B> half = set1<Ds<B>>(0.5);
    const Ds<B> lo = toDoubleLo(s) * f + half, hi = toDoubleHi(s) * f + half;
    // clamp below 256 before the conversion so that no lane overflows it
    const Ds<B> top = set1<Ds<B>>(256.0);
    return toInt32Trunc(min(lo, top), min(hi, top));
}

template <int B>
void intRows8uSimd(const IntKernelTable& table, const uint8_t* top, int srcStep, uint8_t* dst,
                   int samples, const int32_t* kernel, ImageSize ks, int channels,
                   const DivisorScaling& d, bool doubleExact) {
    using namespace simd;
    using I32 = I32s<B>;
    constexpr int L = U8s<B>::kLanes;
    const I32 z = zero<I32>(), round1 = set1<I32>(1);
    const Ds<B> f = set1<Ds<B>>(static_cast<double>(d.factor));
    if (d.mode == 2 && !doubleExact) {
        intRow8u(top, srcStep, dst, 0, samples, kernel, ks, channels, d);
        return;
    }
    for (int x0 = 0; x0 < samples; x0 += L) {
        const int x = x0 + L <= samples ? x0 : samples - L;  // last block overlaps
        I32 acc[4];
        table.sums<B>(top, srcStep, x, channels, acc);
        if (d.mode == 1) {
            for (I32& a : acc) {
                a = a & gt(a, z);  // s < 1 gives 0
                a = shr(a, d.shift) + (shr(a, d.shift - 1) & round1);
            }
        } else if (d.mode == 2) {
            for (I32& a : acc) a = scaleDouble(a, f);
        }
        store(dst + x, packBytes(acc));
    }
}

// Float kernels whose coefficients share a narrow exponent range: each
// coefficient is n_i * 2^g exactly, with |n_i| < 2^28.  Then every partial
// sum of the double accumulation is an exact multiple of 2^g below 2^53 * 2^g,
// so the double sum IS the exact sum, which integer arithmetic gives just as
// well: n_i = hi_i * 2^14 + lo_i, two 16-bit tables, two pmaddwd passes.
class ExactFloatKernel {
public:
    ExactFloatKernel(const float* kernel, ImageSize ks) {
        const int n = ks.width * ks.height;
        if (n > 512) return;  // keeps n * 255 * 2^14 below 2^31
        int gMin = INT_MAX, eMax = INT_MIN;
        for (int i = 0; i < n; ++i) {
            const float c = kernel[i];
            if (!(c - c == 0.0f)) return;  // infinite or NaN
            if (c == 0.0f) continue;
            int e = 0;
            std::frexp(static_cast<double>(c), &e);  // c = m * 2^e, |m| in [0.5, 1), 24 bits
            gMin = std::min(gMin, e - 24);
            eMax = std::max(eMax, e);
        }
        if (gMin == INT_MAX) gMin = 0, eMax = 0;
        if (eMax - gMin > 28 || gMin < -1000) return;
        hi_ = static_cast<int32_t*>(mem::alignedAlloc(static_cast<uint32_t>(2 * n * sizeof(int32_t))));
        if (!hi_) return;
        lo_ = hi_ + n;
        for (int i = 0; i < n; ++i) {
            const int32_t v = static_cast<int32_t>(std::ldexp(static_cast<double>(kernel[i]), -gMin));
            hi_[i] = v >> 14;  // arithmetic: v = hi * 2^14 + lo, lo in [0, 2^14)
            lo_[i] = v & 0x3FFF;
        }
        scale_ = std::ldexp(1.0, gMin);
        hiTable_ = new (std::nothrow) IntKernelTable(hi_, ks);
        loTable_ = new (std::nothrow) IntKernelTable(lo_, ks);
    }
    ~ExactFloatKernel() {
        delete hiTable_;
        delete loTable_;
        mem::alignedFree(hi_);
    }
    ExactFloatKernel(const ExactFloatKernel&) = delete;
    ExactFloatKernel& operator=(const ExactFloatKernel&) = delete;
    bool ok() const { return hiTable_ && loTable_ && hiTable_->ok() && loTable_->ok(); }

    template <int B>
    void row(const uint8_t* top, int srcStep, uint8_t* dst, int samples, int channels) const {
        using namespace simd;
        using D = Ds<B>;
        constexpr int L = U8s<B>::kLanes;
        const D k14 = set1<D>(16384.0), scale = set1<D>(scale_);
        const D half = set1<D>(0.5), topV = set1<D>(256.0);
        // (hi * 2^14 + lo) * scale + 1/2, clamped below 256, truncated
        const auto finish = [&](I32s<B> h, I32s<B> l) {
            const D sLo = (toDoubleLo(h) * k14 + toDoubleLo(l)) * scale;
            const D sHi = (toDoubleHi(h) * k14 + toDoubleHi(l)) * scale;
            return toInt32Trunc(min(sLo + half, topV), min(sHi + half, topV));
        };
        for (int x0 = 0; x0 < samples; x0 += L) {
            const int x = x0 + L <= samples ? x0 : samples - L;
            I32s<B> h[4], l[4];
            hiTable_->sums2<B>(*loTable_, top, srcStep, x, channels, h, l);
            for (int i = 0; i < 4; ++i) h[i] = finish(h[i], l[i]);
            store(dst + x, packBytes(h));
        }
    }

private:
    int32_t* hi_ = nullptr;
    int32_t* lo_ = nullptr;
    double scale_ = 1.0;
    IntKernelTable* hiTable_ = nullptr;
    IntKernelTable* loTable_ = nullptr;
};

// Float kernels on 8u samples, fast and still exact.  The kernel is put on a
// grid of 2^-g: n_i = round(c_i * 2^g), 16-bit integers, and t = sum p_i * n_i
// is formed exactly in 32-bit lanes by pmaddwd.  The true sum S satisfies
// S * 2^g = t + sum p_i * d_i with d_i = c_i * 2^g - n_i in [-1/2, 1/2], so
// S * 2^g lies in [t + 255 * (sum of negative d_i), t + 255 * (sum of positive
// d_i)]; the double accumulation of the generic loop is off S by less than
// (n - 1) * 2^-53 * 255 * sum |c_i|, far below one grid unit (g is chosen so
// that 255 * sum |c_i| * 2^g <= 2^29).  The 8u conversion is a monotonic
// function of the sum and equals exact half-up rounding except within an ulp
// (< 2^-44 below 256) of a half.  So where half-up rounding of both ends of
// the interval, widened by two grid units each side, gives the same byte,
// that byte is what the double loop gives; the remaining samples (sums within
// about 0.01 of a half) are recomputed by the double loop itself.
//
// Kernels whose rows mirror vertically (after the rounding to the grid) add
// the two source rows first: half the multiplies.
class GridFloatKernel {
public:
    GridFloatKernel(const float* kernel, ImageSize ks, int channels, int samples)
        : ks_(ks), channels_(channels), samples_(samples) {
        const int64_t n = static_cast<int64_t>(ks.width) * ks.height;
        if (samples < 16 || n > (int64_t(1) << 20)) return;
        double maxAbs = 0.0, sumAbs = 0.0;
        for (int64_t i = 0; i < n; ++i) {
            const double c = static_cast<double>(kernel[i]);
            if (!(c - c == 0.0)) return;  // infinite or NaN: the double loop decides
            maxAbs = std::max(maxAbs, std::fabs(c));
            sumAbs += std::fabs(c);
        }
        sumAbs *= 1.0 + 1e-9;  // covers the rounding of the sum above
        int g = 31;            // 2^(g-1) must fit the 32-bit lanes
        while (g >= 1 && (maxAbs * std::ldexp(1.0, g) > 32767.0 ||
                          255.0 * sumAbs * std::ldexp(1.0, g) > 536870912.0))
            --g;
        if (g < 1) return;  // huge coefficients: other paths
        shift_ = g;

        pairs_ = (ks.width + 1) / 2;
        const int64_t rowLen = static_cast<int64_t>(samples) + static_cast<int64_t>(ks.width - 1) * channels;
        // walk-order grid kernel first, to test the mirror symmetry
        int32_t* grid = static_cast<int32_t*>(mem::alignedAlloc(static_cast<uint32_t>(n * 4)));
        if (!grid) return;
        double negSum = 0.0, posSum = 0.0;
        for (int r = 0; r < ks.height; ++r)
            for (int q = 0; q < ks.width; ++q) {
                const double c = std::ldexp(static_cast<double>(kernel[n - 1 - r * ks.width - q]), g);
                const double ni = std::floor(c + 0.5);
                const double d = c - ni;  // exact
                (d < 0 ? negSum : posSum) += d;
                grid[r * ks.width + q] = static_cast<int32_t>(ni);
            }
        loOff_ = static_cast<int32_t>(std::floor(255.0 * negSum)) - 2 + (int32_t(1) << (g - 1));
        hiOff_ = static_cast<int32_t>(std::ceil(255.0 * posSum)) + 2 + (int32_t(1) << (g - 1));
        fold_ = ks.height > 1;
        for (int r = 0; fold_ && r < ks.height / 2; ++r)
            fold_ = std::memcmp(grid + r * ks.width, grid + (ks.height - 1 - r) * ks.width,
                                sizeof(int32_t) * size_t(ks.width)) == 0;
        groups_ = fold_ ? (ks.height + 1) / 2 : ks.height;
        const int64_t rowStride = (rowLen + 7) & ~int64_t(7);
        const uint64_t tableBytes = uint64_t(groups_) * uint64_t(pairs_) * sizeof(I16x8);
        const uint64_t bytes = tableBytes + uint64_t(groups_) * uint64_t(rowStride) * 4;
        if (bytes <= 0x7FFFFFFFu) block_ = mem::alignedAlloc(static_cast<uint32_t>(bytes));
        if (block_) {
            // below 2^31 bytes: the row lengths are ordinary indices from here on
            rowLen_ = static_cast<ptrdiff_t>(rowLen);
            rowStride_ = static_cast<ptrdiff_t>(rowStride);
            table_ = static_cast<I16x8*>(block_);
            rows_ = reinterpret_cast<uint32_t*>(static_cast<uint8_t*>(block_) + tableBytes);
            for (int gi = 0; gi < groups_; ++gi)
                for (int p = 0; p < pairs_; ++p) {
                    const int q = 2 * p;
                    const int32_t c0 = grid[gi * ks.width + q];
                    const int32_t c1 = q + 1 < ks.width ? grid[gi * ks.width + q + 1] : 0;
                    table_[gi * pairs_ + p] = coefficientPairs(c0, c1);
                }
        }
        mem::alignedFree(grid);
    }
    ~GridFloatKernel() { mem::alignedFree(block_); }
    GridFloatKernel(const GridFloatKernel&) = delete;
    GridFloatKernel& operator=(const GridFloatKernel&) = delete;
    bool ok() const { return block_ != nullptr; }

    // The row at the widest registers that the samples fill.
    template <int B>
    void row(const uint8_t* top, int srcStep, uint8_t* dst, const float* kernel) const {
        for (int gi = 0; gi < groups_; ++gi) {
            const int other = ks_.height - 1 - gi;
            pairUp<B>(rowAt(top, srcStep, gi), fold_ && other != gi ? rowAt(top, srcStep, other) : nullptr,
                      rows_ + gi * rowStride_);
        }
        switch (ks_.width) {  // the common widths with the tap loop unrolled
        case 3: blocks<3, B>(top, srcStep, dst, kernel); break;
        case 5: blocks<5, B>(top, srcStep, dst, kernel); break;
        case 7: blocks<7, B>(top, srcStep, dst, kernel); break;
        default: blocks<0, B>(top, srcStep, dst, kernel); break;
        }
    }

private:
    // Rounds a register of grid sums (in order) to bytes, each under both
    // ends of its interval; stores the lower ends' bytes and returns the
    // mask of the samples where the two agree.
    template <int B>
    U8s<B> settle(const I32s<B> acc[4], uint8_t* dst) const {
        using namespace simd;
        const auto bytes = [&](int32_t off) {
            I32s<B> v[4];
            for (int i = 0; i < 4; ++i) v[i] = shr(acc[i] + set1<I32s<B>>(off), shift_);
            return packBytesInOrder(v);
        };
        const U8s<B> lo = bytes(loOff_);
        store(dst, lo);
        return eq(lo, bytes(hiOff_));
    }

    // KW: the kernel width when known at compile time, 0 otherwise.
    template <int KW, int B>
    void blocks(const uint8_t* top, int srcStep, uint8_t* dst, const float* kernel) const {
        const int c = channels_;
        const int pairs = KW ? (KW + 1) / 2 : pairs_;
        using namespace simd;
        using I32 = I32s<B>;
        constexpr int L = U8s<B>::kLanes, Q = I32::kLanes;  // samples a register of bytes, of sums
        for (int x0 = 0; x0 < samples_; x0 += L) {
            const int x = x0 + L <= samples_ ? x0 : samples_ - L;  // last block overlaps
            I32 acc[4];
            for (I32& a : acc) a = zero<I32>();
            for (int gi = 0; gi < groups_; ++gi) {
                const uint32_t* w = rows_ + gi * rowStride_ + x;
                const I16x8* t = table_ + gi * pairs_;
                for (int k = 0; k < pairs; ++k) {
                    const uint32_t* pk = w + 2 * k * c;
                    const I16s<B> tk = IntKernelTable::coefficients<B>(t + k);
                    for (int i = 0; i < 4; ++i) acc[i] = acc[i] + mulAddPairs(loadFrom<I16s<B>>(pk + Q * i), tk);
                }
            }
            const U8s<B> sure = settle<B>(acc, dst + x);
            if (allTrue(sure)) continue;
            // a sum too close to a half: the double loop decides
            alignas(B) uint8_t settled[L];
            store(settled, sure);
            for (int i = 0; i < L; ++i)
                if (!settled[i]) floatRow(top, srcStep, dst, x + i, x + i + 1, kernel, ks_, c);
        }
    }

    // The pmaddwd operands of a tap and the next one: w[i] = (v[i], v[i + c])
    // as two 16-bit halves, v = a (+ b) widened, for rowLen_ samples; a
    // partner beyond the row is 0 (it only meets the 0 that pads an odd
    // kernel width).  Widened and paired per 16-byte block, stored block by
    // block in order.
    template <int B>
    void pairUp(const uint8_t* a, const uint8_t* b, uint32_t* w) const {
        using namespace simd;
        using U16 = Vec<uint16_t, B>;
        constexpr int L = U8s<B>::kLanes;
        const ptrdiff_t c = channels_;
        const auto widened = [&](const uint8_t* p, const uint8_t* q, U16& lo, U16& hi) {
            const U8s<B> v = load<U8s<B>>(p);
            lo = widenLo(v);
            hi = widenHi(v);
            if (q) {
                const U8s<B> u = load<U8s<B>>(q);
                lo = lo + widenLo(u);
                hi = hi + widenHi(u);
            }
        };
        ptrdiff_t i = 0;
        for (; i + c + L <= rowLen_; i += L) {
            U16 v0, v1, u0, u1;
            widened(a + i, b ? b + i : nullptr, v0, v1);
            widened(a + i + c, b ? b + i + c : nullptr, u0, u1);
            storeBlocks(w + i, 16, bitcast<uint32_t>(zipLo(v0, u0)));
            storeBlocks(w + i + 4, 16, bitcast<uint32_t>(zipHi(v0, u0)));
            storeBlocks(w + i + 8, 16, bitcast<uint32_t>(zipLo(v1, u1)));
            storeBlocks(w + i + 12, 16, bitcast<uint32_t>(zipHi(v1, u1)));
        }
        auto v = [&](ptrdiff_t j) -> uint32_t { return j < rowLen_ ? uint32_t(a[j] + (b ? b[j] : 0)) : 0u; };
        for (; i < rowLen_; ++i) w[i] = v(i) | (v(i + c) << 16);
    }

    ImageSize ks_;
    int channels_, samples_;
    int shift_ = 0, pairs_ = 0, groups_ = 0;
    bool fold_ = false;
    ptrdiff_t rowLen_ = 0, rowStride_ = 0;  // in 32-bit words; 64-bit sums on 32-bit cost registers
    int32_t loOff_ = 0, hiOff_ = 0;
    void* block_ = nullptr;
    I16x8* table_ = nullptr;
    uint32_t* rows_ = nullptr;
};
#endif

#if ZOR_SIMD >= 4
using I8x16 = simd::Vec<int8_t, 16>;

// Source rows as byte pairs (p[i], p[i + channels]), the operands of
// pmaddubsw for a kernel tap and the next one: each source row is paired
// once and then serves kH output rows.  A ring of kH rows; the pair of the
// last samples, which has no partner in the row, takes 0.
class PairRows {
public:
    PairRows(int rows, int64_t samples, int channels) : rows_(rows), samples_(samples), channels_(channels) {
        const uint64_t bytes = uint64_t(rows) * uint64_t(samples + 8) * 2;
        if (bytes > 0x7FFFFFFFu) return;
        base_ = static_cast<uint16_t*>(mem::alignedAlloc(static_cast<uint32_t>(bytes)));
        order_ = static_cast<const uint16_t**>(mem::alignedAlloc(static_cast<uint32_t>(rows * sizeof(void*))));
        if (!order_) {
            mem::alignedFree(base_);
            base_ = nullptr;
        }
    }
    ~PairRows() {
        mem::alignedFree(base_);
        mem::alignedFree(order_);
    }
    PairRows(const PairRows&) = delete;
    PairRows& operator=(const PairRows&) = delete;
    bool ok() const { return base_ != nullptr; }
    // Before output row y: pairs the source rows it needs that are not yet
    // in the ring (all of them for the first row), top being its first
    // source row; returns the rows, from the top.
    const uint16_t* const* advance(const uint8_t* top, int srcStep, int y) {
        for (int r = y == 0 ? 0 : rows_ - 1; r < rows_; ++r) pair(rowAt(top, srcStep, r), y + r);
        for (int r = 0; r < rows_; ++r) order_[r] = base_ + ((y + r) % rows_) * (samples_ + 8);
        return order_;
    }

private:
    void pair(const uint8_t* p, int sourceRow) {
        uint16_t* out = base_ + (sourceRow % rows_) * (samples_ + 8);
        const int64_t c = channels_;
        int64_t i = 0;
        using namespace simd;
        using U8 = Vec<uint8_t>;
        for (; i + c + U8::kLanes <= samples_; i += U8::kLanes) {
            const U8 a = load<U8>(p + i), b = load<U8>(p + i + c);
            // per 16-byte block: the pairs of its first and last 8 samples
            storeBlocks(out + i, 16, bitcast<uint16_t>(zipLo(a, b)));
            storeBlocks(out + i + 8, 16, bitcast<uint16_t>(zipHi(a, b)));
        }
        for (; i < samples_; ++i)
            out[i] = static_cast<uint16_t>(p[i] | (i + c < samples_ ? p[i + c] << 8 : 0));
    }

    int rows_;
    int64_t samples_;
    int channels_;
    uint16_t* base_ = nullptr;
    const uint16_t** order_ = nullptr;
};

// Small kernels (SSSE3): coefficients as signed bytes, pixel pairs summed by
// pmaddubsw, running sums in 16 bits.  Taken only when nothing can saturate
// or wrap: every coefficient fits a byte, 255 * (|c_q| + |c_q+1|) and
// 255 * sum |c| stay below 2^15, so each sum equals the 32-bit one.
class ByteKernel {
public:
    ByteKernel(const int32_t* kernel, ImageSize ks) : ks_(ks), pairs_((ks.width + 1) / 2) {
        const int n = ks.width * ks.height;
        int64_t total = 0;
        for (int i = 0; i < n; ++i) {
            if (kernel[i] < -128 || kernel[i] > 127) return;
            total += kernel[i] < 0 ? -kernel[i] : kernel[i];
        }
        if (255 * total > 32767) return;  // also bounds every pair
        absMax_ = static_cast<int>(255 * total);
        const uint32_t count = static_cast<uint32_t>(pairs_ * ks.height);
        table_ = static_cast<I8x16*>(mem::alignedAlloc(count * sizeof(I8x16)));
        if (!table_) return;
        for (int r = 0; r < ks.height; ++r)
            for (int p = 0; p < pairs_; ++p) {
                const int q = 2 * p;
                const int32_t c0 = kernel[n - 1 - r * ks.width - q];
                const int32_t c1 = q + 1 < ks.width ? kernel[n - 1 - r * ks.width - q - 1] : 0;
                table_[r * pairs_ + p] = simd::bitcast<int8_t>(simd::set1<I16x8>(static_cast<int16_t>(
                    (static_cast<uint32_t>(c1 & 0xFF) << 8) | static_cast<uint32_t>(c0 & 0xFF))));
            }
    }
    ~ByteKernel() { mem::alignedFree(table_); }
    ByteKernel(const ByteKernel&) = delete;
    ByteKernel& operator=(const ByteKernel&) = delete;
    bool ok() const { return table_ != nullptr; }
    int absMax() const { return absMax_; }

    // 16-bit sums of a register of output samples starting at sample x,
    // per 16-byte block: the first 8 samples of each block in lo, the last 8
    // in hi.
    template <int B>
    void sums(const uint8_t* top, int srcStep, int x, int channels, I16s<B>& lo, I16s<B>& hi) const {
        using namespace simd;
        using U8 = U8s<B>;
        lo = hi = zero<I16s<B>>();
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const I8x16* t = table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                const int q = 2 * k;
                const U8 a = load<U8>(p + q * channels);
                const U8 b = q + 1 < ks_.width ? load<U8>(p + (q + 1) * channels) : zero<U8>();
                const auto tk = coefficients<B>(t + k);
                lo = lo + mulAddPairs(zipLo(a, b), tk);
                hi = hi + mulAddPairs(zipHi(a, b), tk);
            }
        }
    }

    // One output row from the pair rows of its source rows (rows[r]: source
    // row r of the neighbourhood), scaled.  P: the number of tap pairs when
    // known at compile time, 0 otherwise.  Kept out of line: inlined into
    // the caller, its loop lost registers to the caller's values.  The sums
    // are in order: the first half of the register's samples in lo.
    template <int P, int B, class Scale>
    [[gnu::noinline]] void pairedRow(const uint16_t* const* rows, uint8_t* dst, int samples, int channels,
                   const Scale& scale) const {
        using namespace simd;
        using U8 = U8s<B>;
        using I16 = I16s<B>;
        constexpr int L = U8::kLanes;
        const int pairs = P ? P : pairs_;
        for (int x0 = 0; x0 < samples; x0 += L) {
            const int x = x0 + L <= samples ? x0 : samples - L;  // last block overlaps
            I16 lo = zero<I16>(), hi = zero<I16>();
            for (int r = 0; r < ks_.height; ++r) {
                const uint16_t* p = rows[r] + x;
                const I8x16* t = table_ + r * pairs;
                for (int k = 0; k < pairs; ++k) {
                    const uint16_t* q = p + 2 * k * channels;
                    const auto tk = coefficients<B>(t + k);
                    lo = lo + mulAddPairs(loadFrom<U8>(q), tk);
                    hi = hi + mulAddPairs(loadFrom<U8>(q + L / 2), tk);
                }
            }
            store(dst + x, scale.template apply<true>(lo, hi));
        }
    }
    template <int B, class Scale>
    void pairedRow(const uint16_t* const* rows, uint8_t* dst, int samples, int channels,
                   const Scale& scale) const {
        switch (pairs_) {
        case 2: pairedRow<2, B, Scale>(rows, dst, samples, channels, scale); break;
        case 3: pairedRow<3, B, Scale>(rows, dst, samples, channels, scale); break;
        case 4: pairedRow<4, B, Scale>(rows, dst, samples, channels, scale); break;
        default: pairedRow<0, B, Scale>(rows, dst, samples, channels, scale); break;
        }
    }

    // A table entry in every 16-byte block of a register.
    template <int B>
    static simd::Vec<int8_t, B> coefficients(const I8x16* entry) {
        return simd::loadBlocks<simd::Vec<int8_t, B>>(reinterpret_cast<const int8_t*>(entry), 0);
    }

private:
    ImageSize ks_;
    int pairs_;
    int absMax_ = 0;
    I8x16* table_ = nullptr;
};

// Divisor scaling of 16-bit sums.  Mode 2 becomes (s * m + r) >> sh on the
// sum (negated for negative divisors), with m and sh chosen per call and
// checked against the exact scaling for every sum the kernel can produce.
class Scale16 {
public:
    Scale16(const DivisorScaling& d, int absMax) : d_(d) {
        if (d.mode != 2) {
            ok_ = true;
            return;
        }
        negate_ = d.factor < 0;
        const double f = negate_ ? -static_cast<double>(d.factor) : static_cast<double>(d.factor);
        int shMax = 0;
        while (shMax < 29 && f * std::ldexp(1.0, shMax + 1) <= 32767.0) ++shMax;
        for (int sh = shMax; sh >= 1 && sh >= shMax - 2 && !ok_; --sh)
            for (int up = 0; up < 2 && !ok_; ++up) {
                const int64_t m = static_cast<int64_t>(std::floor(f * std::ldexp(1.0, sh))) + up;
                if (m < 0 || m > 32767) continue;
                const int64_t round = int64_t(1) << (sh - 1);
                bool good = true;
                for (int v = 0; v <= absMax && good; ++v) {
                    int64_t q = (v * m + round) >> sh;
                    if (q > 255) q = 255;
                    good = q == scaleSum8u(negate_ ? -v : v, d);
                }
                if (!good) continue;
                const int c = 1 << (sh - 1 < 14 ? sh - 1 : 14);  // round = c * (round / c)
                pairConst_ = static_cast<int16_t>(c);
                mr_ = static_cast<int32_t>(m);
                roundOverC_ = static_cast<int32_t>(round / c);
                shift_ = sh;
                ok_ = true;
            }
    }
    bool ok() const { return ok_; }

    // The bytes of the 16-bit sums lo and hi: per 16-byte block (lo holding
    // the first 8 samples of each block) or, InOrder, lo holding the first
    // half of the register's samples.
    template <bool InOrder, int B>
    U8s<B> apply(I16s<B> lo, I16s<B> hi) const {
        using namespace simd;
        using I16 = I16s<B>;
        const auto bytes = [](I16 a, I16 b) {
            if constexpr (InOrder) return narrowSatInOrder<uint8_t>(a, b);
            else return narrowSat<uint8_t>(a, b);
        };
        const I16 z = zero<I16>();
        if (d_.mode == 0) return bytes(lo, hi);
        if (d_.mode == 1) {
            const I16 one = set1<I16>(1);
            const auto sc = [&](I16 v) {
                v = max(v, z);
                return shr(v, d_.shift) + (shr(v, d_.shift - 1) & one);
            };
            return bytes(sc(lo), sc(hi));
        }
        const I16 pairConst = set1<I16>(pairConst_), mr = coefficientPairs<B>(mr_, roundOverC_);
        const auto sc = [&](I16 v) {
            if (negate_) v = z - v;
            v = max(v, z);
            const I32s<B> a = shr(mulAddPairs(zipLo(v, pairConst), mr), shift_);
            const I32s<B> b = shr(mulAddPairs(zipHi(v, pairConst), mr), shift_);
            return narrowSat<int16_t>(a, b);  // per block: v's order again
        };
        return bytes(sc(lo), sc(hi));
    }

private:
    DivisorScaling d_;
    bool ok_ = false;
    bool negate_ = false;
    // (v, c) . (m, round / c) = v m + round, one pmaddwd
    int16_t pairConst_ = 0;
    int32_t mr_ = 0, roundOverC_ = 0;
    int shift_ = 0;
};
#endif

#if ZOR_SIMD >= 2
// The double loop itself, one register of 16-bit lanes of output samples
// at a time as four registers of doubles: each lane performs the scalar
// loop's operations in its order (exact products, one rounding per
// addition), so the sums are the same bits.
template <int B, class T>
void doubleRow(const T* top, int srcStep, T* dst, int samples, const float* kernel, ImageSize ks,
               int channels) {
    using namespace simd;
    using D = Ds<B>;
    constexpr int L = I16s<B>::kLanes;
    const int n = ks.width * ks.height;
    for (int x0 = 0; x0 < samples; x0 += L) {
        const int x = x0 + L <= samples ? x0 : samples - L;  // last block overlaps
        D acc[4];
        for (D& a : acc) a = zero<D>();
        for (int r = 0; r < ks.height; ++r) {
            const T* p = rowAt(top, srcStep, r) + x;
            const float* k = kernel + n - 1 - r * ks.width;
            for (int q = 0; q < ks.width; ++q) {
                const D c = set1<D>(static_cast<double>(k[-q]));
                // the samples as 16-bit lanes in order, then per 16-byte
                // block (8 samples) as two registers of 32-bit ones
                const auto v = [&] {
                    if constexpr (sizeof(T) == 1) return loadWidened<Vec<uint16_t, B>>(p + q * channels);
                    else return load<I16s<B>>(p + q * channels);
                }();
                const I32s<B> lo = bitcast<int32_t>(widenLo(v)), hi = bitcast<int32_t>(widenHi(v));
                acc[0] = acc[0] + toDoubleLo(lo) * c;
                acc[1] = acc[1] + toDoubleHi(lo) * c;
                acc[2] = acc[2] + toDoubleLo(hi) * c;
                acc[3] = acc[3] + toDoubleHi(hi) * c;
            }
        }
        // block b of acc[i] holds samples 8 b + 2 i and 8 b + 2 i + 1
        alignas(B) double sums[L];
        for (int i = 0; i < 4; ++i) storeBlocks(sums + 2 * i, 8, acc[i]);
        for (int i = 0; i < L; ++i) {
            if constexpr (sizeof(T) == 1)
                dst[x + i] = roundSum8u(sums[i]);
            else
                dst[x + i] = roundSum16s(sums[i]);
        }
    }
}
#endif

}  // namespace
}}  // namespace zor::ZOR_NS
