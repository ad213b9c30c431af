// Kernels of the image DFT: a complex FFT of any length that transforms
// several sequences at once, one per register lane, and the steps that
// turn pairs of real rows or columns into such sequences and back.
//
// Layout.  A batch holds lanesOf<V>() sequences side by side: element e of
// lane l sits at re[e * B + l] and im[e * B + l] (B lanes).  Every
// arithmetic step acts on whole elements, so each lane goes through the
// same float operations in the same order whatever the register width; the
// generic variant runs the same code with V = float and one lane, and gives
// the same bits.
//
// Transform.  Self-sorting (Stockham) decimation in time over the factors
// of n: radix 4 while it divides, then 2, 3, 5, 7 and a general odd radix
// up to kMaxOddRadix.  A length with a larger prime factor goes through
// Bluestein's chirp convolution on a 5-smooth length of at least 2n - 1.
// Only the forward direction (exp(-2 pi i jk / n)) exists: the inverse is
// the forward transform with real and imaginary parts swapped on both
// sides, which costs nothing on split arrays.
#pragma once

#include "frame/simd.h"

#include <cstddef>
#include <cstdint>

namespace zor { namespace ZOR_NS {
namespace {

using simd::lanesOf;

constexpr int kMaxStages = 32;
constexpr int kMaxOddRadix = 31;  // larger prime factors: Bluestein

// ---- twiddles -------------------------------------------------------------------

// cos and sin of 2 pi num / den, from integer octant symmetry and Taylor
// series on [0, pi/4] in double (within a few units of the last double
// place).  Only double +, *, / are used: under a DoublePrecisionScope every
// variant gets the same bits, which a library cos need not give.
void unitRoot(int64_t num, int64_t den, double& c, double& s) {
    num %= den;
    if (num < 0) num += den;
    const int64_t e = 8 * num;
    const int octant = static_cast<int>(e / den);
    const int64_t rem = e % den;
    const double quarterPi = 0.78539816339744830962;
    const double x = quarterPi * (static_cast<double>((octant & 1) ? den - rem : rem) / static_cast<double>(den));
    const double x2 = x * x;
    // sin x = x (1 - x^2/3! + ... + x^16/17!), cos x = 1 - x^2/2! + ... + x^18/18!:
    // the first terms left out are below 2^-60 of the result on [0, pi/4].
    static const double kSin[] = {1.0, -1.0 / 6, 1.0 / 120, -1.0 / 5040, 1.0 / 362880, -1.0 / 39916800,
                                  1.0 / 6227020800.0, -1.0 / 1307674368000.0, 1.0 / 355687428096000.0};
    static const double kCos[] = {1.0, -1.0 / 2, 1.0 / 24, -1.0 / 720, 1.0 / 40320, -1.0 / 3628800,
                                  1.0 / 479001600.0, -1.0 / 87178291200.0, 1.0 / 20922789888000.0,
                                  -1.0 / 6402373705728000.0};
    double sn = kSin[8];
    for (int i = 7; i >= 0; --i) sn = kSin[i] + x2 * sn;
    sn *= x;
    double cs = kCos[9];
    for (int i = 8; i >= 0; --i) cs = kCos[i] + x2 * cs;
    // angle = octant pi/4 + x (even octants) or (octant + 1) pi/4 - x (odd)
    switch (octant) {
        case 0: c = cs, s = sn; break;
        case 1: c = sn, s = cs; break;
        case 2: c = -sn, s = cs; break;
        case 3: c = -cs, s = sn; break;
        case 4: c = -cs, s = -sn; break;
        case 5: c = -sn, s = -cs; break;
        case 6: c = sn, s = -cs; break;
        default: c = cs, s = -sn; break;
    }
}

// exp(-2 pi i num / den) as two floats (re, im).
void forwardRoot(int64_t num, int64_t den, float* out) {
    double c, s;
    unitRoot(num, den, c, s);
    out[0] = toFloat(c);
    out[1] = toFloat(-s);
}

// ---- plans ------------------------------------------------------------------------

struct Stage {
    int32_t radix;
    const float* twiddles;  // per q < span: radix - 1 pairs w^(v q), w = exp(-2 pi i / (span radix))
    const float* roots;     // odd radices: exp(-2 pi i j / radix), j < radix
};

struct Plan {
    int32_t n;
    int32_t stageCount;
    Stage stages[kMaxStages];
    int32_t convLength;     // Bluestein: length of the cyclic convolution, else 0
    const Plan* conv;       // its (direct) plan
    const float* chirp;     // exp(-pi i k^2 / n), k < n
    const float* kernel;    // transform of the conjugate chirp, divided by convLength
};

// ---- complex elements ---------------------------------------------------------------

template <class V>
struct Cx {
    V re, im;
};
template <class V>
inline Cx<V> operator+(Cx<V> a, Cx<V> b) { return {a.re + b.re, a.im + b.im}; }
template <class V>
inline Cx<V> operator-(Cx<V> a, Cx<V> b) { return {a.re - b.re, a.im - b.im}; }
// a (wr + i wi)
template <class V>
inline Cx<V> mul(Cx<V> a, V wr, V wi) { return {a.re * wr - a.im * wi, a.re * wi + a.im * wr}; }

// A batch of complex sequences in split arrays (see the layout above).
template <class V>
struct Span {
    static constexpr int kB = lanesOf<V>();
    float* re;
    float* im;
    Cx<V> get(ptrdiff_t e) const { return {simd::load<V>(re + e * kB), simd::load<V>(im + e * kB)}; }
    void put(ptrdiff_t e, Cx<V> c) const {
        simd::store(re + e * kB, c.re);
        simd::store(im + e * kB, c.im);
    }
    Span swapped() const { return {im, re}; }
};

// ---- butterflies ----------------------------------------------------------------------

template <class V>
struct Radix2 {
    static constexpr int kP = 2;
    static constexpr bool kFixed = true;
    void operator()(Cx<V>* a) const {
        const Cx<V> a0 = a[0];
        a[0] = a0 + a[1];
        a[1] = a0 - a[1];
    }
};

template <class V>
struct Radix4 {
    static constexpr int kP = 4;
    static constexpr bool kFixed = true;
    void operator()(Cx<V>* a) const {
        const Cx<V> s02 = a[0] + a[2], d02 = a[0] - a[2], s13 = a[1] + a[3], d13 = a[1] - a[3];
        a[0] = s02 + s13;
        a[2] = s02 - s13;
        a[1] = {d02.re + d13.im, d02.im - d13.re};  // d02 - i d13
        a[3] = {d02.re - d13.im, d02.im + d13.re};  // d02 + i d13
    }
};

// Odd radix p (P = p, or 0 for a radix known at run time): with
// t_v = a_v + a_(p-v), d_v = a_v - a_(p-v) and theta = 2 pi v s / p,
// y_s = a0 + sum t_v cos theta - i sum d_v sin theta, y_(p-s) the conjugate
// combination.
template <class V, int P>
struct RadixOdd {
    static constexpr int kP = P ? P : kMaxOddRadix;
    static constexpr bool kFixed = P != 0;
    static constexpr int kH = (kP - 1) / 2;
    int p, h;
    V cosines[kH][kH], sines[kH][kH];  // [v - 1][s - 1]

    RadixOdd(int radix, const float* roots) : p(radix), h((radix - 1) / 2) {
        for (int v = 1; v <= h; ++v)
            for (int s = 1; s <= h; ++s) {
                const int j = (v * s) % p;
                cosines[v - 1][s - 1] = simd::set1<V>(roots[2 * j]);
                sines[v - 1][s - 1] = simd::set1<V>(-roots[2 * j + 1]);
            }
    }
    void operator()(Cx<V>* a) const {
        Cx<V> t[kH], d[kH];
        Cx<V> y0 = a[0];
        for (int v = 1; v <= h; ++v) {
            t[v - 1] = a[v] + a[p - v];
            d[v - 1] = a[v] - a[p - v];
            y0 = y0 + t[v - 1];
        }
        for (int s = 1; s <= h; ++s) {
            Cx<V> r = a[0], i = {simd::zero<V>(), simd::zero<V>()};
            for (int v = 1; v <= h; ++v) {
                const V c = cosines[v - 1][s - 1], sn = sines[v - 1][s - 1];
                r = r + Cx<V>{t[v - 1].re * c, t[v - 1].im * c};
                i = i + Cx<V>{d[v - 1].re * sn, d[v - 1].im * sn};
            }
            a[s] = {r.re + i.im, r.im - i.re};      // r - i i
            a[p - s] = {r.re - i.im, r.im + i.re};  // r + i i
        }
        a[0] = y0;
    }
};

// One Stockham step: from sub-transforms of length `span` (x) to length
// span p (y).  For q < span and k < n / (span p), inputs
// x[q r + v r' + k] (r = n / span, r' = r / p) times w^(v q) give outputs
// y[q r' + s span r' + k].
template <class V, class Butterfly>
void runStage(Span<V> x, Span<V> y, int n, int span, int radix, const float* tw, const Butterfly& bf) {
    constexpr int kP = Butterfly::kP;
    const int p = Butterfly::kFixed ? kP : radix;  // a constant where it can be: loops unroll
    const ptrdiff_t rOut = n / (ptrdiff_t(span) * p), outStride = ptrdiff_t(span) * rOut;
    Cx<V> a[kP];
    for (int q = 0; q < span; ++q) {
        const ptrdiff_t in = q * p * rOut, out = q * rOut;
        if (q == 0) {
            for (ptrdiff_t k = 0; k < rOut; ++k) {
                for (int v = 0; v < p; ++v) a[v] = x.get(in + v * rOut + k);
                bf(a);
                for (int s = 0; s < p; ++s) y.put(out + s * outStride + k, a[s]);
            }
            continue;
        }
        V wr[kP], wi[kP];
        const float* t = tw + 2 * ptrdiff_t(q) * (p - 1);
        for (int v = 1; v < p; ++v) {
            wr[v] = simd::set1<V>(t[2 * v - 2]);
            wi[v] = simd::set1<V>(t[2 * v - 1]);
        }
        for (ptrdiff_t k = 0; k < rOut; ++k) {
            a[0] = x.get(in + k);
            for (int v = 1; v < p; ++v) a[v] = mul(x.get(in + v * rOut + k), wr[v], wi[v]);
            bf(a);
            for (int s = 0; s < p; ++s) y.put(out + s * outStride + k, a[s]);
        }
    }
}

// ---- the transform --------------------------------------------------------------------

template <class V>
Span<V> bluestein(const Plan& plan, Span<V> data, Span<V> work);

// The forward transform of the batch in `data` (n elements), working in
// `work` (as long); returns the pair of arrays that holds the result.
template <class V>
Span<V> transform(const Plan& plan, Span<V> data, Span<V> work) {
    if (plan.convLength) return bluestein<V>(plan, data, work);
    int span = 1;
    for (int i = 0; i < plan.stageCount; ++i) {
        const Stage& st = plan.stages[i];
        const int p = st.radix;
        switch (p) {
            case 2: runStage(data, work, plan.n, span, p, st.twiddles, Radix2<V>{}); break;
            case 3: runStage(data, work, plan.n, span, p, st.twiddles, RadixOdd<V, 3>(p, st.roots)); break;
            case 4: runStage(data, work, plan.n, span, p, st.twiddles, Radix4<V>{}); break;
            case 5: runStage(data, work, plan.n, span, p, st.twiddles, RadixOdd<V, 5>(p, st.roots)); break;
            case 7: runStage(data, work, plan.n, span, p, st.twiddles, RadixOdd<V, 7>(p, st.roots)); break;
            default: runStage(data, work, plan.n, span, p, st.twiddles, RadixOdd<V, 0>(p, st.roots)); break;
        }
        const Span<V> t = data;
        data = work;
        work = t;
        span *= p;
    }
    return data;
}

// X_k = c_k sum_j (x_j c_j) conj(c_(k-j)) with c_k = exp(-pi i k^2 / n): a
// cyclic convolution of length m = convLength, done as transform, product
// with the kernel's transform, inverse transform.  data and work hold m
// elements.
template <class V>
Span<V> bluestein(const Plan& plan, Span<V> data, Span<V> work) {
    const int n = plan.n, m = plan.convLength;
    const float* c = plan.chirp;
    for (int k = 0; k < n; ++k)
        data.put(k, mul(data.get(k), simd::set1<V>(c[2 * k]), simd::set1<V>(c[2 * k + 1])));
    const Cx<V> zero{simd::zero<V>(), simd::zero<V>()};
    for (int k = n; k < m; ++k) data.put(k, zero);
    const Span<V> f = transform(*plan.conv, data, work);
    const Span<V> spare = f.re == data.re ? work : data;
    const float* kern = plan.kernel;
    for (int k = 0; k < m; ++k)
        f.put(k, mul(f.get(k), simd::set1<V>(kern[2 * k]), simd::set1<V>(kern[2 * k + 1])));
    const Span<V> g = transform(*plan.conv, f.swapped(), spare.swapped()).swapped();
    for (int k = 0; k < n; ++k)
        g.put(k, mul(g.get(k), simd::set1<V>(c[2 * k]), simd::set1<V>(c[2 * k + 1])));
    return g;
}

// ---- real sequences in pairs ----------------------------------------------------------

// z is the transform of a + i b (a, b real, n elements).  Writes the spectra
// of a and b in CCS order: position 0 X0, positions 2k-1 and 2k Re Xk and
// Im Xk for 0 < k < n/2, and position n-1 X(n/2) when n is even.
template <class V>
void splitSpectra(Span<V> z, int n, float* a, float* b) {
    constexpr int kB = lanesOf<V>();
    const V half = simd::set1<V>(0.5f);
    simd::store(a, simd::load<V>(z.re));
    simd::store(b, simd::load<V>(z.im));
    for (int k = 1; 2 * k < n; ++k) {
        const Cx<V> p = z.get(k), q = z.get(n - k);
        simd::store(a + (2 * k - 1) * ptrdiff_t(kB), half * (p.re + q.re));
        simd::store(a + 2 * k * ptrdiff_t(kB), half * (p.im - q.im));
        simd::store(b + (2 * k - 1) * ptrdiff_t(kB), half * (p.im + q.im));
        simd::store(b + 2 * k * ptrdiff_t(kB), half * (q.re - p.re));
    }
    if (n % 2 == 0 && n > 1) {
        simd::store(a + (n - 1) * ptrdiff_t(kB), simd::load<V>(z.re + n / 2 * ptrdiff_t(kB)));
        simd::store(b + (n - 1) * ptrdiff_t(kB), simd::load<V>(z.im + n / 2 * ptrdiff_t(kB)));
    }
}

// The inverse of splitSpectra: the full sequence A + i B from two CCS
// spectra, each extended by its conjugate symmetry.
template <class V>
void joinSpectra(const float* a, const float* b, int n, Span<V> z) {
    constexpr int kB = lanesOf<V>();
    z.put(0, {simd::load<V>(a), simd::load<V>(b)});
    for (int k = 1; 2 * k < n; ++k) {
        const V ar = simd::load<V>(a + (2 * k - 1) * ptrdiff_t(kB)), ai = simd::load<V>(a + 2 * k * ptrdiff_t(kB));
        const V br = simd::load<V>(b + (2 * k - 1) * ptrdiff_t(kB)), bi = simd::load<V>(b + 2 * k * ptrdiff_t(kB));
        z.put(k, {ar - bi, ai + br});
        z.put(n - k, {ar + bi, br - ai});
    }
    if (n % 2 == 0 && n > 1)
        z.put(n / 2, {simd::load<V>(a + (n - 1) * ptrdiff_t(kB)), simd::load<V>(b + (n - 1) * ptrdiff_t(kB))});
}

// Multiplies n elements of every lane by s.
template <class V>
void scaleSpan(Span<V> z, int n, float s) {
    const V f = simd::set1<V>(s);
    for (ptrdiff_t e = 0; e < n; ++e) z.put(e, {z.get(e).re * f, z.get(e).im * f});
}

// ---- moving rows and columns in and out of batches ------------------------------------

// Rows y0 + 2l (into `even`, lane l) and y0 + 2l + 1 (into `odd`) of the
// image, width w; rows at or past h read as zeros.
template <class V>
void gatherRows(const float* img, int step, int y0, int h, int w, float* even, float* odd) {
    constexpr int kB = lanesOf<V>();
    for (int parity = 0; parity < 2; ++parity) {
        const float* rows[kB];
        for (int l = 0; l < kB; ++l) {
            const int y = y0 + 2 * l + parity;
            rows[l] = y < h ? rowAt(img, step, y) : nullptr;
        }
        float* out = parity ? odd : even;
        int x = 0;
        for (; x + kB <= w; x += kB) {
            V r[kB];
            for (int l = 0; l < kB; ++l) r[l] = rows[l] ? simd::load<V>(rows[l] + x) : simd::zero<V>();
            simd::transpose(r);
            for (int j = 0; j < kB; ++j) simd::store(out + ptrdiff_t(x + j) * kB, r[j]);
        }
        for (; x < w; ++x)
            for (int l = 0; l < kB; ++l) out[ptrdiff_t(x) * kB + l] = rows[l] ? rows[l][x] : 0.0f;
    }
}

// The inverse of gatherRows for the rows below h.
template <class V>
void scatterRows(const float* even, const float* odd, float* img, int step, int y0, int h, int w) {
    constexpr int kB = lanesOf<V>();
    for (int parity = 0; parity < 2; ++parity) {
        float* rows[kB];
        for (int l = 0; l < kB; ++l) {
            const int y = y0 + 2 * l + parity;
            rows[l] = y < h ? rowAt(img, step, y) : nullptr;
        }
        const float* in = parity ? odd : even;
        int x = 0;
        for (; x + kB <= w; x += kB) {
            V r[kB];
            for (int j = 0; j < kB; ++j) r[j] = simd::load<V>(in + ptrdiff_t(x + j) * kB);
            simd::transpose(r);
            for (int l = 0; l < kB; ++l)
                if (rows[l]) simd::store(rows[l] + x, r[l]);
        }
        for (; x < w; ++x)
            for (int l = 0; l < kB; ++l)
                if (rows[l]) rows[l][x] = in[ptrdiff_t(x) * kB + l];
    }
}

// Columns of complex values: `count` pairs (re, im) from element x of every
// row, pair j into lane j % B of slots[j / B]; unused lanes of the last
// slot are zeros.  One sweep down the rows serves every slot, so that each
// row's cache lines are fetched once.
template <class V>
void gatherPairs(const float* img, int step, int h, int x, int count, const Span<V>* slots) {
    constexpr int kB = lanesOf<V>();
    for (int y = 0; y < h; ++y) {
        const float* p = rowAt(img, step, y) + x;
        for (int j = 0; j < count; j += kB, p += 2 * kB) {
            const Span<V>& z = slots[j / kB];
            if (count - j >= kB) {
                V re, im;
                simd::deinterleave(simd::load<V>(p), simd::load<V>(p + kB), re, im);
                z.put(y, {re, im});
                continue;
            }
            for (int l = 0; l < kB; ++l) {
                z.re[ptrdiff_t(y) * kB + l] = l < count - j ? p[2 * l] : 0.0f;
                z.im[ptrdiff_t(y) * kB + l] = l < count - j ? p[2 * l + 1] : 0.0f;
            }
        }
    }
}

template <class V>
void scatterPairs(const Span<V>* slots, float* img, int step, int h, int x, int count) {
    constexpr int kB = lanesOf<V>();
    for (int y = 0; y < h; ++y) {
        float* p = rowAt(img, step, y) + x;
        for (int j = 0; j < count; j += kB, p += 2 * kB) {
            const Span<V>& z = slots[j / kB];
            if (count - j >= kB) {
                const Cx<V> c = z.get(y);
                V lo, hi;
                simd::interleave(c.re, c.im, lo, hi);
                simd::store(p, lo);
                simd::store(p + kB, hi);
                continue;
            }
            for (int l = 0; l < count - j; ++l) {
                p[2 * l] = z.re[ptrdiff_t(y) * kB + l];
                p[2 * l + 1] = z.im[ptrdiff_t(y) * kB + l];
            }
        }
    }
}

// One or two real columns (x0 into a, x1 into b; x1 < 0: zeros) in lane 0.
void gatherColumns(const float* img, int step, int h, int x0, int x1, float* a, float* b, int lanes) {
    for (int y = 0; y < h; ++y) {
        const float* p = rowAt(img, step, y);
        for (int l = 0; l < lanes; ++l) {
            a[ptrdiff_t(y) * lanes + l] = l == 0 ? p[x0] : 0.0f;
            b[ptrdiff_t(y) * lanes + l] = l == 0 && x1 >= 0 ? p[x1] : 0.0f;
        }
    }
}

void scatterColumns(const float* a, const float* b, int lanes, float* img, int step, int h, int x0, int x1) {
    for (int y = 0; y < h; ++y) {
        float* p = rowAt(img, step, y);
        p[x0] = a[ptrdiff_t(y) * lanes];
        if (x1 >= 0) p[x1] = b[ptrdiff_t(y) * lanes];
    }
}

}  // namespace
}}  // namespace zor::ZOR_NS
