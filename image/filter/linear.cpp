// Linear filters with a caller-supplied kernel: true convolution (the kernel
// is flipped in both axes), no border handling (every source pixel that the
// flipped kernel covers must exist around the ROI), and an anchor that is
// deliberately not validated: any anchor only moves the neighbourhood.
//
// Integer kernels (8u): sums wrap in 32 bits, then the divisor is applied in
// one of three modes (1: none; a power of two: shift with half-up rounding;
// anything else: multiply by the float reciprocal, exactly, half up).  Every
// non-positive quotient yields 0.
//
// Float kernels: the sum is accumulated in double in neighbourhood order (top
// row first, left to right), then rounded half up (8u, NaN to 0) or half away
// from zero (16s, NaN to 0) and saturated.
//
// The 16s integer form scales the kernel by the float reciprocal of the
// divisor and runs the float-kernel 16s filter.
#include "frame/variant.h"
#include "frame/row_address.h"
#include "frame/fpu.h"
#include "frame/memory.h"
#include "frame/status.h"

#include <climits>
#include <cmath>
#include <cstddef>
#include <cstring>
#include <algorithm>
#include <new>

namespace zor { namespace ZOR_NS {
namespace {

// ---- geometry -----------------------------------------------------------------

// Walking the neighbourhood from its top-left pixel with the kernel reversed
// is the same as convolving with the kernel: tap (r, q) of the walk (row r
// from the top, column q from the left) takes coefficient
// K[kH-1-r][kW-1-q].
struct Walk {
    ptrdiff_t left;  // samples from the ROI pixel back to the neighbourhood's left column
    ptrdiff_t up;    // rows from the ROI row up to the neighbourhood's top row
};

inline Walk walkOf(ImageSize kernelSize, ImagePoint anchor, int channels) {
    return {(static_cast<ptrdiff_t>(kernelSize.width) - 1 - anchor.x) * channels,
            static_cast<ptrdiff_t>(kernelSize.height) - 1 - anchor.y};
}


inline int64_t rowSamples(int width, int kernelWidth, int channels) {
    return (static_cast<int64_t>(width) + kernelWidth - 1) * channels;
}

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
        if (uint64_t(count) * sizeof(__m128i) > 0x7FFFFFFFu) return;
        table_ = static_cast<__m128i*>(mem::alignedAlloc(count * sizeof(__m128i)));
        if (!table_) return;
        const int n = ks.width * ks.height;
        for (int r = 0; r < ks.height; ++r)
            for (int p = 0; p < pairs_; ++p) {
                const int q = 2 * p;
                const int32_t c0 = kernel[n - 1 - r * ks.width - q];
                const int32_t c1 = q + 1 < ks.width ? kernel[n - 1 - r * ks.width - q - 1] : 0;
                table_[r * pairs_ + p] =
                    _mm_set1_epi32(static_cast<int32_t>((static_cast<uint32_t>(c1) << 16) |
                                                        (static_cast<uint32_t>(c0) & 0xFFFFu)));
            }
    }
    ~IntKernelTable() { mem::alignedFree(table_); }
    IntKernelTable(const IntKernelTable&) = delete;
    IntKernelTable& operator=(const IntKernelTable&) = delete;
    bool ok() const { return table_ != nullptr; }

    // The 16 samples at p of kernel columns q and q + 1 (0 past the kernel's
    // width) as four vectors of 16-bit pairs, ready for pmaddwd.
    void columnPairs(const uint8_t* p, int q, int channels, __m128i v[4]) const {
        const __m128i zero = _mm_setzero_si128();
        const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + q * channels));
        const __m128i b = q + 1 < ks_.width
                              ? _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + (q + 1) * channels))
                              : zero;
        const __m128i alo = _mm_unpacklo_epi8(a, zero), ahi = _mm_unpackhi_epi8(a, zero);
        const __m128i blo = _mm_unpacklo_epi8(b, zero), bhi = _mm_unpackhi_epi8(b, zero);
        v[0] = _mm_unpacklo_epi16(alo, blo);
        v[1] = _mm_unpackhi_epi16(alo, blo);
        v[2] = _mm_unpacklo_epi16(ahi, bhi);
        v[3] = _mm_unpackhi_epi16(ahi, bhi);
    }

    // Sums of 16 output samples starting at sample x.
    void sums(const uint8_t* top, int srcStep, int x, int channels, __m128i acc[4]) const {
        for (int i = 0; i < 4; ++i) acc[i] = _mm_setzero_si128();
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const __m128i* t = table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                __m128i v[4];
                columnPairs(p, 2 * k, channels, v);
                for (int i = 0; i < 4; ++i) acc[i] = _mm_add_epi32(acc[i], _mm_madd_epi16(v[i], t[k]));
            }
        }
    }

    // Sums of two kernels of the same shape over the same pixels (each pixel
    // pair unpacked once).
    void sums2(const IntKernelTable& other, const uint8_t* top, int srcStep, int x, int channels,
               __m128i acc[4], __m128i acc2[4]) const {
        const __m128i zero = _mm_setzero_si128();
        for (int i = 0; i < 4; ++i) acc[i] = acc2[i] = zero;
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const __m128i* t = table_ + r * pairs_;
            const __m128i* t2 = other.table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                __m128i v[4];
                columnPairs(p, 2 * k, channels, v);
                for (int i = 0; i < 4; ++i) {
                    acc[i] = _mm_add_epi32(acc[i], _mm_madd_epi16(v[i], t[k]));
                    acc2[i] = _mm_add_epi32(acc2[i], _mm_madd_epi16(v[i], t2[k]));
                }
            }
        }
    }

private:
    ImageSize ks_;
    int pairs_ = 0;
    __m128i* table_ = nullptr;
};

// Mode 2 in double: exact when |sum| * |mant| < 2^53 and sum * factor + 0.5
// needs no rounding below 256 (exp <= 44).
inline __m128i scaleDouble(__m128i s, __m128d f) {
    const __m128d half = _mm_set1_pd(0.5);
    const __m128d lo = _mm_add_pd(_mm_mul_pd(_mm_cvtepi32_pd(s), f), half);
    const __m128d hi = _mm_add_pd(_mm_mul_pd(_mm_cvtepi32_pd(_mm_shuffle_epi32(s, 0x4E)), f), half);
    // clamp below 256 before the conversion so that no lane overflows it
    const __m128d top = _mm_set1_pd(256.0);
    const __m128i a = _mm_cvttpd_epi32(_mm_min_pd(lo, top));
    const __m128i b = _mm_cvttpd_epi32(_mm_min_pd(hi, top));
    return _mm_unpacklo_epi64(a, b);
}

void intRows8uSimd(const IntKernelTable& table, const uint8_t* top, int srcStep, uint8_t* dst,
                   int samples, const int32_t* kernel, ImageSize ks, int channels,
                   const DivisorScaling& d, bool doubleExact) {
    const __m128i zero = _mm_setzero_si128();
    const __m128d f = _mm_set1_pd(static_cast<double>(d.factor));
    const __m128i round1 = _mm_set1_epi32(1);
    const __m128i shiftK = _mm_cvtsi32_si128(d.shift);
    const __m128i shiftK1 = _mm_cvtsi32_si128(d.shift - 1);
    if (d.mode == 2 && !doubleExact) {
        intRow8u(top, srcStep, dst, 0, samples, kernel, ks, channels, d);
        return;
    }
    for (int x0 = 0; x0 < samples; x0 += 16) {
        const int x = x0 + 16 <= samples ? x0 : samples - 16;  // last block overlaps
        __m128i acc[4];
        table.sums(top, srcStep, x, channels, acc);
        if (d.mode == 1) {
            for (__m128i& a : acc) {
                a = _mm_and_si128(a, _mm_cmpgt_epi32(a, zero));  // s < 1 gives 0
                a = _mm_add_epi32(_mm_sra_epi32(a, shiftK),
                                  _mm_and_si128(_mm_sra_epi32(a, shiftK1), round1));
            }
        } else if (d.mode == 2) {
            for (__m128i& a : acc) a = scaleDouble(a, f);
        }
        const __m128i lo = _mm_packs_epi32(acc[0], acc[1]);
        const __m128i hi = _mm_packs_epi32(acc[2], acc[3]);
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + x), _mm_packus_epi16(lo, hi));
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

    void row(const uint8_t* top, int srcStep, uint8_t* dst, int samples, int channels) const {
        const __m128d k14 = _mm_set1_pd(16384.0), scale = _mm_set1_pd(scale_);
        const __m128d half = _mm_set1_pd(0.5), topV = _mm_set1_pd(256.0);
        auto finish = [&](__m128i h, __m128i l) {
            auto two = [&](__m128i hh, __m128i ll) {
                const __m128d s = _mm_mul_pd(
                    _mm_add_pd(_mm_mul_pd(_mm_cvtepi32_pd(hh), k14), _mm_cvtepi32_pd(ll)), scale);
                return _mm_cvttpd_epi32(_mm_min_pd(_mm_add_pd(s, half), topV));
            };
            return _mm_unpacklo_epi64(two(h, l), two(_mm_shuffle_epi32(h, 0x4E), _mm_shuffle_epi32(l, 0x4E)));
        };
        for (int x0 = 0; x0 < samples; x0 += 16) {
            const int x = x0 + 16 <= samples ? x0 : samples - 16;
            __m128i h[4], l[4];
            hiTable_->sums2(*loTable_, top, srcStep, x, channels, h, l);
            for (int i = 0; i < 4; ++i) h[i] = finish(h[i], l[i]);
            const __m128i a = _mm_packs_epi32(h[0], h[1]), b = _mm_packs_epi32(h[2], h[3]);
            _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + x), _mm_packus_epi16(a, b));
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
        rowLen_ = static_cast<int64_t>(samples) + static_cast<int64_t>(ks.width - 1) * channels;
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
        rowStride_ = (rowLen_ + 7) & ~int64_t(7);
        const uint64_t tableBytes = uint64_t(groups_) * uint64_t(pairs_) * sizeof(__m128i);
        const uint64_t bytes = tableBytes + uint64_t(groups_) * uint64_t(rowStride_) * 4;
        if (bytes <= 0x7FFFFFFFu) block_ = mem::alignedAlloc(static_cast<uint32_t>(bytes));
        if (block_) {
            table_ = static_cast<__m128i*>(block_);
            rows_ = reinterpret_cast<uint32_t*>(static_cast<uint8_t*>(block_) + tableBytes);
            for (int gi = 0; gi < groups_; ++gi)
                for (int p = 0; p < pairs_; ++p) {
                    const int q = 2 * p;
                    const int32_t c0 = grid[gi * ks.width + q];
                    const int32_t c1 = q + 1 < ks.width ? grid[gi * ks.width + q + 1] : 0;
                    table_[gi * pairs_ + p] = _mm_set1_epi32(static_cast<int32_t>(
                        (static_cast<uint32_t>(c1) << 16) | (static_cast<uint32_t>(c0) & 0xFFFFu)));
                }
        }
        mem::alignedFree(grid);
    }
    ~GridFloatKernel() { mem::alignedFree(block_); }
    GridFloatKernel(const GridFloatKernel&) = delete;
    GridFloatKernel& operator=(const GridFloatKernel&) = delete;
    bool ok() const { return block_ != nullptr; }

    void row(const uint8_t* top, int srcStep, uint8_t* dst, const float* kernel) const {
        for (int gi = 0; gi < groups_; ++gi) {
            const int other = ks_.height - 1 - gi;
            pairUp(rowAt(top, srcStep, gi), fold_ && other != gi ? rowAt(top, srcStep, other) : nullptr,
                   rows_ + gi * rowStride_);
        }
        switch (ks_.width) {  // the common widths with the tap loop unrolled
        case 3: blocks<3>(top, srcStep, dst, kernel); break;
        case 5: blocks<5>(top, srcStep, dst, kernel); break;
        case 7: blocks<7>(top, srcStep, dst, kernel); break;
        default: blocks<0>(top, srcStep, dst, kernel); break;
        }
    }

private:
    // Rounds 16 grid sums to bytes, each under both ends of its interval;
    // returns the samples where they differ.
    unsigned settle(const __m128i acc[4], uint8_t* dst) const {
        const __m128i g = _mm_cvtsi32_si128(shift_);
        auto bytes = [&](__m128i off) {
            __m128i v[4];
            for (int i = 0; i < 4; ++i) v[i] = _mm_sra_epi32(_mm_add_epi32(acc[i], off), g);
            return _mm_packus_epi16(_mm_packs_epi32(v[0], v[1]), _mm_packs_epi32(v[2], v[3]));
        };
        const __m128i lo = bytes(_mm_set1_epi32(loOff_)), hi = bytes(_mm_set1_epi32(hiOff_));
        _mm_storeu_si128(reinterpret_cast<__m128i*>(dst), lo);
        return ~static_cast<unsigned>(_mm_movemask_epi8(_mm_cmpeq_epi8(lo, hi))) & 0xFFFFu;
    }

    // KW: the kernel width when known at compile time, 0 otherwise.
    template <int KW>
    void blocks(const uint8_t* top, int srcStep, uint8_t* dst, const float* kernel) const {
        const int c = channels_;
        const int pairs = KW ? (KW + 1) / 2 : pairs_;
        const __m128i zero = _mm_setzero_si128();
        for (int x0 = 0; x0 < samples_; x0 += 16) {
            const int x = x0 + 16 <= samples_ ? x0 : samples_ - 16;  // last block overlaps
            __m128i acc[4] = {zero, zero, zero, zero};
            for (int gi = 0; gi < groups_; ++gi) {
                const uint32_t* w = rows_ + gi * rowStride_ + x;
                const __m128i* t = table_ + gi * pairs_;
                for (int k = 0; k < pairs; ++k) {
                    const __m128i* pk = reinterpret_cast<const __m128i*>(w + 2 * k * c);
                    const __m128i tk = t[k];
                    for (int i = 0; i < 4; ++i)
                        acc[i] = _mm_add_epi32(acc[i], _mm_madd_epi16(_mm_loadu_si128(pk + i), tk));
                }
            }
            unsigned unsure = settle(acc, dst + x);
            while (unsure) {  // a sum too close to a half: the double loop decides
                const int i = __builtin_ctz(unsure);
                unsure &= unsure - 1;
                floatRow(top, srcStep, dst, x + i, x + i + 1, kernel, ks_, c);
            }
        }
    }

    // The pmaddwd operands of a tap and the next one: w[i] = (v[i], v[i + c])
    // as two 16-bit halves, v = a (+ b) widened, for rowLen_ samples; a
    // partner beyond the row is 0 (it only meets the 0 that pads an odd
    // kernel width).
    void pairUp(const uint8_t* a, const uint8_t* b, uint32_t* w) const {
        const __m128i zero = _mm_setzero_si128();
        const int64_t c = channels_;
        auto widened = [&](const uint8_t* p, const uint8_t* q, __m128i& lo, __m128i& hi) {
            const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
            lo = _mm_unpacklo_epi8(v, zero);
            hi = _mm_unpackhi_epi8(v, zero);
            if (q) {
                const __m128i u = _mm_loadu_si128(reinterpret_cast<const __m128i*>(q));
                lo = _mm_add_epi16(lo, _mm_unpacklo_epi8(u, zero));
                hi = _mm_add_epi16(hi, _mm_unpackhi_epi8(u, zero));
            }
        };
        int64_t i = 0;
        for (; i + c + 16 <= rowLen_; i += 16) {
            __m128i v0, v1, u0, u1;
            widened(a + i, b ? b + i : nullptr, v0, v1);
            widened(a + i + c, b ? b + i + c : nullptr, u0, u1);
            __m128i* o = reinterpret_cast<__m128i*>(w + i);
            _mm_storeu_si128(o, _mm_unpacklo_epi16(v0, u0));
            _mm_storeu_si128(o + 1, _mm_unpackhi_epi16(v0, u0));
            _mm_storeu_si128(o + 2, _mm_unpacklo_epi16(v1, u1));
            _mm_storeu_si128(o + 3, _mm_unpackhi_epi16(v1, u1));
        }
        auto v = [&](int64_t j) -> uint32_t { return j < rowLen_ ? uint32_t(a[j] + (b ? b[j] : 0)) : 0u; };
        for (; i < rowLen_; ++i) w[i] = v(i) | (v(i + c) << 16);
    }

    ImageSize ks_;
    int channels_, samples_;
    int shift_ = 0, pairs_ = 0, groups_ = 0;
    bool fold_ = false;
    int64_t rowLen_ = 0, rowStride_ = 0;
    int32_t loOff_ = 0, hiOff_ = 0;
    void* block_ = nullptr;
    __m128i* table_ = nullptr;
    uint32_t* rows_ = nullptr;
};
#endif

#if ZOR_SIMD >= 4
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
        for (; i + c + 16 <= samples_; i += 16) {
            const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i));
            const __m128i b = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + i + c));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i), _mm_unpacklo_epi8(a, b));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(out + i + 8), _mm_unpackhi_epi8(a, b));
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
        table_ = static_cast<__m128i*>(mem::alignedAlloc(count * sizeof(__m128i)));
        if (!table_) return;
        for (int r = 0; r < ks.height; ++r)
            for (int p = 0; p < pairs_; ++p) {
                const int q = 2 * p;
                const int32_t c0 = kernel[n - 1 - r * ks.width - q];
                const int32_t c1 = q + 1 < ks.width ? kernel[n - 1 - r * ks.width - q - 1] : 0;
                table_[r * pairs_ + p] = _mm_set1_epi16(static_cast<int16_t>(
                    (static_cast<uint32_t>(c1 & 0xFF) << 8) | static_cast<uint32_t>(c0 & 0xFF)));
            }
    }
    ~ByteKernel() { mem::alignedFree(table_); }
    ByteKernel(const ByteKernel&) = delete;
    ByteKernel& operator=(const ByteKernel&) = delete;
    bool ok() const { return table_ != nullptr; }
    int absMax() const { return absMax_; }

    // 16-bit sums of 16 output samples starting at sample x.
    void sums(const uint8_t* top, int srcStep, int x, int channels, __m128i& lo, __m128i& hi) const {
        const __m128i zero = _mm_setzero_si128();
        lo = hi = zero;
        for (int r = 0; r < ks_.height; ++r) {
            const uint8_t* p = rowAt(top, srcStep, r) + x;
            const __m128i* t = table_ + r * pairs_;
            for (int k = 0; k < pairs_; ++k) {
                const int q = 2 * k;
                const __m128i a = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + q * channels));
                const __m128i b = q + 1 < ks_.width
                                      ? _mm_loadu_si128(reinterpret_cast<const __m128i*>(p + (q + 1) * channels))
                                      : zero;
                lo = _mm_add_epi16(lo, _mm_maddubs_epi16(_mm_unpacklo_epi8(a, b), t[k]));
                hi = _mm_add_epi16(hi, _mm_maddubs_epi16(_mm_unpackhi_epi8(a, b), t[k]));
            }
        }
    }

    // One output row from the pair rows of its source rows (rows[r]: source
    // row r of the neighbourhood), scaled.  P: the number of tap pairs when
    // known at compile time, 0 otherwise.  Kept out of line: inlined into
    // the caller, its loop lost registers to the caller's values.
    template <int P, class Scale>
    [[gnu::noinline]] void pairedRow(const uint16_t* const* rows, uint8_t* dst, int samples, int channels,
                   const Scale& scale) const {
        const int pairs = P ? P : pairs_;
        for (int x0 = 0; x0 < samples; x0 += 16) {
            const int x = x0 + 16 <= samples ? x0 : samples - 16;  // last block overlaps
            __m128i lo = _mm_setzero_si128(), hi = _mm_setzero_si128();
            for (int r = 0; r < ks_.height; ++r) {
                const uint16_t* p = rows[r] + x;
                const __m128i* t = table_ + r * pairs;
                for (int k = 0; k < pairs; ++k) {
                    const uint16_t* q = p + 2 * k * channels;
                    lo = _mm_add_epi16(lo, _mm_maddubs_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(q)), t[k]));
                    hi = _mm_add_epi16(hi, _mm_maddubs_epi16(_mm_loadu_si128(reinterpret_cast<const __m128i*>(q + 8)), t[k]));
                }
            }
            _mm_storeu_si128(reinterpret_cast<__m128i*>(dst + x), scale.apply(lo, hi));
        }
    }
    template <class Scale>
    void pairedRow(const uint16_t* const* rows, uint8_t* dst, int samples, int channels,
                   const Scale& scale) const {
        switch (pairs_) {
        case 2: pairedRow<2, Scale>(rows, dst, samples, channels, scale); break;
        case 3: pairedRow<3, Scale>(rows, dst, samples, channels, scale); break;
        case 4: pairedRow<4, Scale>(rows, dst, samples, channels, scale); break;
        default: pairedRow<0, Scale>(rows, dst, samples, channels, scale); break;
        }
    }

private:
    ImageSize ks_;
    int pairs_;
    int absMax_ = 0;
    __m128i* table_ = nullptr;
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
                pairConst_ = _mm_set1_epi16(static_cast<int16_t>(c));
                mr_ = _mm_set1_epi32(static_cast<int32_t>((static_cast<uint32_t>(round / c) << 16) |
                                                          static_cast<uint32_t>(m)));
                shift_ = _mm_cvtsi32_si128(sh);
                ok_ = true;
            }
    }
    bool ok() const { return ok_; }

    __m128i apply(__m128i lo, __m128i hi) const {
        const __m128i zero = _mm_setzero_si128();
        if (d_.mode == 0) return _mm_packus_epi16(lo, hi);
        if (d_.mode == 1) {
            const __m128i k = _mm_cvtsi32_si128(d_.shift), k1 = _mm_cvtsi32_si128(d_.shift - 1);
            const __m128i one = _mm_set1_epi16(1);
            auto sc = [&](__m128i v) {
                v = _mm_max_epi16(v, zero);
                return _mm_add_epi16(_mm_sra_epi16(v, k), _mm_and_si128(_mm_sra_epi16(v, k1), one));
            };
            return _mm_packus_epi16(sc(lo), sc(hi));
        }
        auto sc = [&](__m128i v) {
            if (negate_) v = _mm_sub_epi16(zero, v);
            v = _mm_max_epi16(v, zero);
            const __m128i a = _mm_sra_epi32(_mm_madd_epi16(_mm_unpacklo_epi16(v, pairConst_), mr_), shift_);
            const __m128i b = _mm_sra_epi32(_mm_madd_epi16(_mm_unpackhi_epi16(v, pairConst_), mr_), shift_);
            return _mm_packs_epi32(a, b);
        };
        return _mm_packus_epi16(sc(lo), sc(hi));
    }

private:
    DivisorScaling d_;
    bool ok_ = false;
    bool negate_ = false;
    __m128i pairConst_{}, mr_{}, shift_{};
};
#endif

#if ZOR_SIMD >= 2
// 8 samples of a row as 32-bit integers.
inline void load8(const uint8_t* p, __m128i& lo, __m128i& hi) {
    const __m128i v = _mm_unpacklo_epi8(_mm_loadl_epi64(reinterpret_cast<const __m128i*>(p)), _mm_setzero_si128());
    lo = _mm_unpacklo_epi16(v, _mm_setzero_si128());
    hi = _mm_unpackhi_epi16(v, _mm_setzero_si128());
}
inline void load8(const int16_t* p, __m128i& lo, __m128i& hi) {
    const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
    const __m128i sign = _mm_srai_epi16(v, 15);
    lo = _mm_unpacklo_epi16(v, sign);
    hi = _mm_unpackhi_epi16(v, sign);
}

// The double loop itself, 8 output samples at a time, two per register:
// each lane performs the scalar loop's operations in its order (exact
// products, one rounding per addition), so the sums are the same bits.
template <class T>
void doubleRow(const T* top, int srcStep, T* dst, int samples, const float* kernel, ImageSize ks,
               int channels) {
    const int n = ks.width * ks.height;
    for (int x0 = 0; x0 < samples; x0 += 8) {
        const int x = x0 + 8 <= samples ? x0 : samples - 8;  // last block overlaps
        __m128d acc[4] = {_mm_setzero_pd(), _mm_setzero_pd(), _mm_setzero_pd(), _mm_setzero_pd()};
        for (int r = 0; r < ks.height; ++r) {
            const T* p = rowAt(top, srcStep, r) + x;
            const float* k = kernel + n - 1 - r * ks.width;
            for (int q = 0; q < ks.width; ++q) {
                const __m128d c = _mm_set1_pd(static_cast<double>(k[-q]));
                __m128i lo, hi;
                load8(p + q * channels, lo, hi);
                acc[0] = _mm_add_pd(acc[0], _mm_mul_pd(_mm_cvtepi32_pd(lo), c));
                acc[1] = _mm_add_pd(acc[1], _mm_mul_pd(_mm_cvtepi32_pd(_mm_shuffle_epi32(lo, 0xEE)), c));
                acc[2] = _mm_add_pd(acc[2], _mm_mul_pd(_mm_cvtepi32_pd(hi), c));
                acc[3] = _mm_add_pd(acc[3], _mm_mul_pd(_mm_cvtepi32_pd(_mm_shuffle_epi32(hi, 0xEE)), c));
            }
        }
        alignas(16) double sums[8];
        for (int i = 0; i < 4; ++i) _mm_store_pd(sums + 2 * i, acc[i]);
        for (int i = 0; i < 8; ++i) {
            if constexpr (sizeof(T) == 1)
                dst[x + i] = roundSum8u(sums[i]);
            else
                dst[x + i] = roundSum16s(sums[i]);
        }
    }
}
#endif

// ---- the filters ---------------------------------------------------------------

// Steps that cannot hold a source row of (width + kW - 1) samples or a
// destination row of width samples.
Status badFilterSteps(int srcStep, int dstStep, ImageSize roi, ImageSize ks, int channels,
                      int sampleBytes) {
    if (srcStep < rowSamples(roi.width, ks.width, channels) * sampleBytes ||
        dstStep < static_cast<int64_t>(roi.width) * channels * sampleBytes)
        return StatusBadStep;
    return StatusOk;
}

Status badSizes(ImageSize roi, ImageSize ks) {
    return (roi.width <= 0 || roi.height <= 0 || ks.width <= 0 || ks.height <= 0)
               ? StatusBadSize
               : StatusOk;
}

Status filterInt8u(const uint8_t* src, int srcStep, uint8_t* dst, int dstStep, ImageSize roi,
                   const int32_t* kernel, ImageSize ks, ImagePoint anchor, int divisor,
                   int channels) {
    if (Status s = checkFirst(anyNull(src, dst, kernel), badSizes(roi, ks),
                              divisor == 0 ? StatusBadDivisor : StatusOk,
                              badFilterSteps(srcStep, dstStep, roi, ks, channels, 1)))
        return s;
    const DivisorScaling d = divisorScaling(divisor);
    const Walk walk = walkOf(ks, anchor, channels);
    const int samples = roi.width * channels;
    const uint8_t* top = rowAt(src, srcStep, -walk.up) - walk.left;
#if ZOR_SIMD >= 4
    if (samples >= 16) {
        ByteKernel bytes(kernel, ks);
        if (bytes.ok()) {
            const Scale16 scale(d, bytes.absMax());
            if (scale.ok()) {
                PairRows pairs(ks.height, rowSamples(roi.width, ks.width, channels), channels);
                for (int y = 0; y < roi.height; ++y) {
                    const uint8_t* t = rowAt(top, srcStep, y);
                    uint8_t* o = rowAt(dst, dstStep, y);
                    if (pairs.ok()) {
                        bytes.pairedRow(pairs.advance(t, srcStep, y), o, samples, channels, scale);
                        continue;
                    }
                    for (int x0 = 0; x0 < samples; x0 += 16) {
                        const int x = x0 + 16 <= samples ? x0 : samples - 16;  // last block overlaps
                        __m128i lo, hi;
                        bytes.sums(t, srcStep, x, channels, lo, hi);
                        _mm_storeu_si128(reinterpret_cast<__m128i*>(o + x), scale.apply(lo, hi));
                    }
                }
                return StatusOk;
            }
        }
    }
#endif
#if ZOR_SIMD >= 2
    if (samples >= 16) {
        IntKernelTable table(kernel, ks);
        if (table.ok()) {
            // largest possible |sum|, for the exactness of the double path
            int64_t absSum = 0;
            for (int i = 0; i < ks.width * ks.height; ++i)
                absSum += 255 * static_cast<int64_t>(kernel[i] < 0 ? -int64_t(kernel[i]) : kernel[i]);
            const bool doubleExact = d.mode == 2 && absSum < (int64_t(1) << 29) && d.exp <= 44;
            for (int y = 0; y < roi.height; ++y)
                intRows8uSimd(table, rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y),
                              samples, kernel, ks, channels, d, doubleExact);
            return StatusOk;
        }
    }
#endif
    for (int y = 0; y < roi.height; ++y)
        intRow8u(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), 0, samples, kernel, ks,
                 channels, d);
    return StatusOk;
}

template <class T>
Status filterFloat(const T* src, int srcStep, T* dst, int dstStep, ImageSize roi,
                   const float* kernel, ImageSize ks, ImagePoint anchor, int channels) {
    if (Status s = checkFirst(anyNull(src, dst, kernel), badSizes(roi, ks),
                              badFilterSteps(srcStep, dstStep, roi, ks, channels, sizeof(T))))
        return s;
    DoublePrecisionScope precision;
    const Walk walk = walkOf(ks, anchor, channels);
    const int samples = roi.width * channels;
    const T* top = rowAt(src, srcStep, -walk.up) - walk.left;
#if ZOR_SIMD >= 2
    if constexpr (sizeof(T) == 1) {
        GridFloatKernel grid(kernel, ks, channels, samples);
        if (grid.ok()) {
            for (int y = 0; y < roi.height; ++y)
                grid.row(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), kernel);
            return StatusOk;
        }
        if (samples >= 16) {
            ExactFloatKernel exact(kernel, ks);
            if (exact.ok()) {
                for (int y = 0; y < roi.height; ++y)
                    exact.row(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), samples, channels);
                return StatusOk;
            }
        }
    }
    if (samples >= 8) {
        for (int y = 0; y < roi.height; ++y)
            doubleRow(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), samples, kernel, ks, channels);
        return StatusOk;
    }
#endif
    for (int y = 0; y < roi.height; ++y)
        floatRow(rowAt(top, srcStep, y), srcStep, rowAt(dst, dstStep, y), 0, samples, kernel, ks,
                 channels);
    return StatusOk;
}

}  // namespace

Status ZOR_CALL zoriFilter_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize dstRoiSize, const int32_t* pKernel,
                                  ImageSize kernelSize, ImagePoint anchor, int divisor) {
    return filterInt8u(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor,
                       divisor, 1);
}

Status ZOR_CALL zoriFilter_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                  ImageSize dstRoiSize, const int32_t* pKernel,
                                  ImageSize kernelSize, ImagePoint anchor, int divisor) {
    return filterInt8u(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor,
                       divisor, 3);
}

Status ZOR_CALL zoriFilter32f_8u_C1R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, const float* pKernel,
                                     ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 1);
}

Status ZOR_CALL zoriFilter32f_8u_C3R(const uint8_t* pSrc, int srcStep, uint8_t* pDst, int dstStep,
                                     ImageSize dstRoiSize, const float* pKernel,
                                     ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 3);
}

Status ZOR_CALL zoriFilter32f_16s_C1R(const int16_t* pSrc, int srcStep, int16_t* pDst,
                                      int dstStep, ImageSize dstRoiSize, const float* pKernel,
                                      ImageSize kernelSize, ImagePoint anchor) {
    return filterFloat(pSrc, srcStep, pDst, dstStep, dstRoiSize, pKernel, kernelSize, anchor, 1);
}

// Deliberately built on the float-kernel filter: each coefficient becomes
// float(coefficient) * float(1.0 / divisor), rounded to float, so that the
// 16s results follow the float form's rounding (half away from zero).
Status ZOR_CALL zoriFilter_16s_C1R(const int16_t* pSrc, int srcStep, int16_t* pDst, int dstStep,
                                   ImageSize dstRoiSize, const int32_t* pKernel,
                                   ImageSize kernelSize, ImagePoint anchor, int divisor) {
    if (!pKernel) return StatusNullPointer;
    if (kernelSize.width <= 0 || kernelSize.height <= 0) return StatusBadSize;
    if (divisor == 0) return StatusBadDivisor;
    const uint64_t n = static_cast<uint64_t>(kernelSize.width) * static_cast<uint64_t>(kernelSize.height);
    if (n * sizeof(float) > 0xFFFFFF00u) return StatusNoMemory;
    float* scaled = static_cast<float*>(mem::alignedAlloc(static_cast<uint32_t>(n * sizeof(float))));
    if (!scaled) return StatusNoMemory;
    {
        DoublePrecisionScope precision;
        const float f = toFloat(1.0 / static_cast<double>(divisor));
        for (uint64_t i = 0; i < n; ++i)  // float * float is exact in double, then rounded once
            scaled[i] = toFloat(static_cast<double>(toFloat(static_cast<double>(pKernel[i]))) *
                                static_cast<double>(f));
    }
    const Status s = ZOR_NS::zoriFilter32f_16s_C1R(pSrc, srcStep, pDst, dstStep, dstRoiSize, scaled,
                                           kernelSize, anchor);
    mem::alignedFree(scaled);
    return s;
}

}}  // namespace zor::ZOR_NS
