// Power-of-two FFTs on float data: complex transforms on split arrays and a
// forward real transform packed as CCS.
//
// Method (orders 4 and up): decimation in time.  The first pass gathers the
// input in bit-reversed order and does the 4-point transforms in the same
// go; an optional radix-2 pass and radix-4 passes follow, each with its own
// precomputed twiddle table laid out in the order the passes read it.  The
// inverse is the forward transform with real and imaginary parts swapped on
// both sides, which costs nothing on split arrays.  The real transform runs
// the complex one on the N/2 even/odd pairs and recombines.
//
// The butterflies are written once over a four-lane vector type: SSE
// registers from variant 1 up, a plain four-float record in the generic
// variant.  The wide columns run the same float operations per output in
// fewer sweeps over memory: the first pass and the L = 4 pass as one, and
// (with 32 registers) the radix-4 passes two at a time.
#include "frame/variant.h"
#include "frame/status.h"
#include "frame/memory.h"
#include "frame/fpu.h"
#include "frame/simd.h"
#include "signal/transform/fft_internal.h"

#include <cmath>
#include <cstring>
#include <type_traits>

namespace zor { namespace ZOR_NS {
namespace {

constexpr int32_t kIdComplex = 5;
constexpr int32_t kIdReal = 6;
constexpr int kMaxOrder = 30;
constexpr int kSmallOrder = 10;  // up to here: static sine table, no work buffer

// The spec record as callers' memory holds it; the engine's own plan
// follows the published fields.
struct FftSpec {
    int32_t id;
    int32_t order;
    int32_t forwardScaled;
    int32_t inverseScaled;
    float scale;
    uint32_t hint;
    int32_t bufferSize;
    int32_t allocated;
    const int32_t* bitReverse;   // first pass: output quad of each input quad
    const float* twiddles;       // quarter-wave sine table or the computed pass tables
    const float* realTwiddles;   // 0.5 cos(2 pi k / N), k = 0 .. N/4
    const float* realTwiddles2;  // -0.5 sin(2 pi k / N)
    // engine
    int32_t cOrder;              // order of the complex engine (order - 1 for real specs)
    const float* passTw;         // pass twiddle tables, one after the other
};

// sin(2 pi k / 1024), k = 0 .. 256.
alignas(32) const float kQuarterSine[257] = {
0.0f, 0.00613588467f, 0.0122715384f, 0.0184067301f, 0.024541229f, 0.030674804f, 0.0368072242f,
0.0429382585f, 0.0490676761f, 0.0551952459f, 0.061320737f, 0.0674439222f, 0.0735645667f,
0.0796824396f, 0.0857973099f, 0.0919089541f, 0.0980171412f, 0.104121633f, 0.110222206f,
0.116318628f, 0.122410677f, 0.128498107f, 0.134580702f, 0.140658244f, 0.146730468f,
0.152797192f, 0.15885815f, 0.164913118f, 0.170961887f, 0.177004218f, 0.183039889f, 0.18906866f,
0.195090324f, 0.201104641f, 0.207111374f, 0.213110313f, 0.219101235f, 0.225083917f,
0.231058106f, 0.237023607f, 0.242980182f, 0.248927608f, 0.254865646f, 0.260794103f,
0.266712755f, 0.272621363f, 0.27851969f, 0.284407526f, 0.290284663f, 0.296150893f, 0.302005947f,
0.307849646f, 0.313681751f, 0.319502026f, 0.32531029f, 0.331106305f, 0.336889863f, 0.342660725f,
0.348418683f, 0.354163527f, 0.359895051f, 0.365612984f, 0.371317208f, 0.377007425f,
0.382683426f, 0.388345033f, 0.393992037f, 0.399624199f, 0.405241311f, 0.410843164f,
0.416429549f, 0.422000259f, 0.427555084f, 0.433093816f, 0.438616246f, 0.444122136f,
0.449611336f, 0.455083579f, 0.460538715f, 0.465976506f, 0.471396744f, 0.47679922f, 0.482183784f,
0.487550169f, 0.492898196f, 0.498227656f, 0.50353837f, 0.50883013f, 0.514102757f, 0.519356012f,
0.524589658f, 0.529803634f, 0.534997642f, 0.540171444f, 0.545324981f, 0.550457954f,
0.555570245f, 0.560661554f, 0.565731823f, 0.570780754f, 0.575808167f, 0.580813944f,
0.585797846f, 0.590759695f, 0.59569931f, 0.600616455f, 0.605511069f, 0.610382795f, 0.615231574f,
0.620057225f, 0.624859512f, 0.629638255f, 0.634393275f, 0.639124453f, 0.643831551f, 0.64851439f,
0.653172851f, 0.657806695f, 0.662415802f, 0.666999936f, 0.671558976f, 0.676092684f,
0.680601001f, 0.685083687f, 0.689540565f, 0.693971455f, 0.698376238f, 0.702754736f,
0.707106769f, 0.711432219f, 0.715730846f, 0.720002532f, 0.724247098f, 0.728464365f,
0.732654274f, 0.736816585f, 0.740951121f, 0.745057762f, 0.749136388f, 0.753186822f,
0.757208824f, 0.761202395f, 0.765167236f, 0.769103348f, 0.773010433f, 0.77688849f, 0.780737221f,
0.784556568f, 0.78834641f, 0.792106569f, 0.795836926f, 0.799537241f, 0.803207517f, 0.806847572f,
0.81045717f, 0.81403631f, 0.817584813f, 0.8211025f, 0.824589312f, 0.82804507f, 0.831469595f,
0.834862888f, 0.838224709f, 0.841554999f, 0.84485358f, 0.848120332f, 0.851355195f, 0.854557991f,
0.857728601f, 0.860866964f, 0.863972843f, 0.867046237f, 0.870086968f, 0.873094976f,
0.876070082f, 0.879012227f, 0.881921291f, 0.884797096f, 0.887639642f, 0.890448749f,
0.893224299f, 0.895966232f, 0.898674488f, 0.901348829f, 0.903989315f, 0.906595707f,
0.909168005f, 0.91170603f, 0.914209783f, 0.916679084f, 0.919113874f, 0.921514034f, 0.923879504f,
0.926210225f, 0.928506076f, 0.93076694f, 0.932992816f, 0.935183525f, 0.937339008f, 0.939459205f,
0.941544056f, 0.943593442f, 0.945607305f, 0.947585583f, 0.949528158f, 0.95143503f, 0.953306019f,
0.955141187f, 0.956940353f, 0.958703458f, 0.960430503f, 0.962121427f, 0.963776052f,
0.965394437f, 0.966976464f, 0.968522072f, 0.970031261f, 0.971503913f, 0.972939968f,
0.974339366f, 0.975702107f, 0.977028131f, 0.97831738f, 0.979569793f, 0.980785251f, 0.981963873f,
0.983105481f, 0.984210074f, 0.985277653f, 0.986308098f, 0.987301409f, 0.988257587f,
0.989176512f, 0.990058184f, 0.990902662f, 0.991709769f, 0.992479563f, 0.993211925f,
0.993906975f, 0.994564593f, 0.99518472f, 0.995767415f, 0.996312618f, 0.996820271f, 0.997290432f,
0.997723043f, 0.998118103f, 0.998475552f, 0.99879545f, 0.999077737f, 0.999322355f, 0.999529421f,
0.999698818f, 0.999830604f, 0.999924719f, 0.999981165f, 1.0f
};

// cos and sin of 2 pi num / den, rounded to float: from the static table
// when den divides 1024, else computed in double.
void unitRoot(int64_t num, int64_t den, float& c, float& s) {
    num %= den;
    if (num < 0) num += den;
    if (den <= 1024) {
        const int i = static_cast<int>(num * (1024 / den));
        auto sine = [](int j) {  // sin(2 pi j / 1024), j in 0 .. 1023
            const int q = j >> 8, r = j & 255;
            const float v = (q & 1) ? kQuarterSine[256 - r] : kQuarterSine[r];
            return q >= 2 ? -v : v;
        };
        s = sine(i);
        c = sine((i + 256) & 1023);
        return;
    }
    const double a = 6.283185307179586 * static_cast<double>(num) / static_cast<double>(den);
    c = static_cast<float>(std::cos(a));
    s = static_cast<float>(std::sin(a));
}

// ---- four-lane vectors ----------------------------------------------------
//
// The passes count out four lanes: V is a 16-byte register of the lane
// vocabulary from SSE on, and in the generic variant a plain record with the
// same operations, lane by lane.

#if ZOR_SIMD >= 1
using namespace simd;
using V = Vec<float, 16>;
// The radix-4 passes over long enough sub-transforms also run on the
// column's widest registers (wider in the x86-64 wide columns): the same
// operations lane for lane, so the same bits.
using WideV = Vec<float>;
#else
struct V {
    static constexpr int kLanes = 4;
    float v[4];
};
template <class>
inline V load(const float* p) { return {{p[0], p[1], p[2], p[3]}}; }
inline void store(float* p, V a) { for (int i = 0; i < 4; ++i) p[i] = a.v[i]; }
template <class>
inline V set1(float x) { return {{x, x, x, x}}; }
inline V operator+(V a, V b) { for (int i = 0; i < 4; ++i) a.v[i] += b.v[i]; return a; }
inline V operator-(V a, V b) { for (int i = 0; i < 4; ++i) a.v[i] -= b.v[i]; return a; }
inline V operator*(V a, V b) { for (int i = 0; i < 4; ++i) a.v[i] *= b.v[i]; return a; }
inline void transpose4(V& a, V& b, V& c, V& d) {
    V* r[4] = {&a, &b, &c, &d};
    for (int i = 0; i < 4; ++i)
        for (int j = i + 1; j < 4; ++j) {
            const float t = r[i]->v[j];
            r[i]->v[j] = r[j]->v[i];
            r[j]->v[i] = t;
        }
}
inline V reverseLanes(V a) { return {{a.v[3], a.v[2], a.v[1], a.v[0]}}; }
inline V concatEven(V a, V b) { return {{a.v[0], a.v[2], b.v[0], b.v[2]}}; }
inline V concatOdd(V a, V b) { return {{a.v[1], a.v[3], b.v[1], b.v[3]}}; }
inline V zipLo(V a, V b) { return {{a.v[0], b.v[0], a.v[1], b.v[1]}}; }
inline V zipHi(V a, V b) { return {{a.v[2], b.v[2], a.v[3], b.v[3]}}; }
#endif

// (ar + i ai)(wr + i wi)
template <class U>
inline void cmul(U ar, U ai, U wr, U wi, U& rr, U& ri) {
    rr = ar * wr - ai * wi;
    ri = ar * wi + ai * wr;
}

// ---- passes -----------------------------------------------------------------


// Input lanes c, c+1, ... of four streams q apart: lane l is element c + l
// of the subsequences x[b], x[b + q], x[b + 2q], x[b + 3q].
struct SplitInput {
    const float* r;
    const float* m;
    template <class U = V>
    U re(int i) const { return load<U>(r + i); }
    template <class U = V>
    U im(int i) const { return load<U>(m + i); }
};
// Complex values packed as re, im pairs (the real transform's input): four
// lanes at a time.
struct PairInput {
    const float* p;
    template <class U = V>
    U re(int i) const { return concatEven(load<V>(p + 2 * i), load<V>(p + 2 * i + 4)); }
    template <class U = V>
    U im(int i) const { return concatOdd(load<V>(p + 2 * i), load<V>(p + 2 * i + 4)); }
};

// Block b (four lanes) of the transposed y holds the 4-point transform of
// subsequence b4 + 4b: it goes to 4 * rev[b4 + 4b].
template <class U>
inline void storeTransforms(float* w, const int32_t* rev, int b4, U y) {
#if ZOR_SIMD >= 1
    if constexpr (U::kLanes > 4) {
        eachBlock(y, [&](int b, V quad) { store(w + 4 * rev[b4 + 4 * b], quad); });
        return;
    }
#endif
    store(w + 4 * rev[b4], y);
}

// The 4-point transforms of the subsequences c, c+1, ... (one per lane of
// U): y[k] gets the real parts of output k (Imag false) or the imaginary
// ones.  Each half needs only one difference from the other, which keeps the
// working set within eight registers (the 32-bit build has no more).
template <bool Imag, class U, class In>
inline void fourPoint(const In& in, int c, int q, U (&y)[4]) {
    const auto own = [&](int i) {
        if constexpr (Imag) return in.template im<U>(i);
        else return in.template re<U>(i);
    };
    const auto other = [&](int i) {
        if constexpr (Imag) return in.template re<U>(i);
        else return in.template im<U>(i);
    };
    const U d13 = other(c + q) - other(c + 3 * q);
    const U g0 = own(c), g1 = own(c + q), g2 = own(c + 2 * q), g3 = own(c + 3 * q);
    const U s02 = g0 + g2, d02 = g0 - g2, s13 = g1 + g3;
    y[0] = s02 + s13, y[2] = s02 - s13;
    // y1 = d02 - i d13, y3 = d02 + i d13
    if constexpr (Imag) y[1] = d02 - d13, y[3] = d02 + d13;
    else y[1] = d02 + d13, y[3] = d02 - d13;
}

// Bit-reversed gather fused with the 4-point transforms: the transform of
// subsequence b lands at 4 * rev[b] of the work arrays, U::kLanes
// subsequences at a time, the real parts first.
template <class U, class In>
void firstPass(const In& in, float* wr, float* wi, int n, const int32_t* rev) {
    const int q = n >> 2;
    for (int c = 0; c < q; c += U::kLanes) {
        U y[4];
        fourPoint<false>(in, c, q, y);
        transpose4(y[0], y[1], y[2], y[3]);
        for (int k = 0; k < 4; ++k) storeTransforms(wr, rev, c + k, y[k]);
        fourPoint<true>(in, c, q, y);
        transpose4(y[0], y[1], y[2], y[3]);
        for (int k = 0; k < 4; ++k) storeTransforms(wi, rev, c + k, y[k]);
    }
}

#if ZOR_SIMD >= 1
// The first pass and the radix-4 pass over its 4-point transforms (L = 4)
// in one, for the wide registers: lanes run over b0 < n/16, and the
// sixteen points b0 + u n/16 stay in registers.  Their four subsequences
// b0 + t n/16 give the 4-point transforms (quarter t of the 16-point one),
// the butterflies combine them per output k with the L = 4 twiddles tw, and
// a transpose turns the sixteen outputs of each lane into the rows of the
// 16-point sub-transform at 4 * rev[b0].
template <class U, class In>
void firstTwoPasses(const In& in, float* wr, float* wi, int n, const int32_t* rev, const float* tw) {
    const int q = n >> 2, e = n >> 4;
    for (int c = 0; c < e; c += U::kLanes) {
        U yr[4][4], yi[4][4];  // [t][k]
        for (int t = 0; t < 4; ++t) {
            fourPoint<false>(in, c + t * e, q, yr[t]);
            fourPoint<true>(in, c + t * e, q, yi[t]);
        }
        U zr[16], zi[16];  // output 4j + k
        for (int k = 0; k < 4; ++k) {
            struct {
                const U (*r)[4];
                const U (*i)[4];
                int k;
                U re(int t) const { return r[t][k]; }
                U im(int t) const { return i[t][k]; }
            } x{yr, yi, k};
            struct {
                U *r, *i;
                int k;
                void re(int j, U v) { r[4 * j + k] = v; }
                void im(int j, U v) { i[4 * j + k] = v; }
            } out{zr, zi, k};
            radix4(x, out, set1<U>(tw[k]), set1<U>(tw[4 + k]), set1<U>(tw[8 + k]), set1<U>(tw[12 + k]),
                   set1<U>(tw[16 + k]), set1<U>(tw[20 + k]));
        }
        // Per lane l of a block: transpose4 gathers output blocks 4j .. 4j+3
        // of b0 = c + 4b + l into block b of register 4j + l, and
        // transposeBlocks4 over j collects them into rows of the b0.
        constexpr int kBlocks = U::kLanes / 4;
        for (int j = 0; j < 4; ++j) {
            transpose4(zr[4 * j], zr[4 * j + 1], zr[4 * j + 2], zr[4 * j + 3]);
            transpose4(zi[4 * j], zi[4 * j + 1], zi[4 * j + 2], zi[4 * j + 3]);
        }
        for (int l = 0; l < 4; ++l) {
            transposeBlocks4(zr[l], zr[4 + l], zr[8 + l], zr[12 + l]);
            transposeBlocks4(zi[l], zi[4 + l], zi[8 + l], zi[12 + l]);
            for (int r = 0; r < 4; ++r) {
                const int at = 4 * rev[c + 4 * (r % kBlocks) + l] + 4 * kBlocks * (r / kBlocks);
                store(wr + at, zr[4 * r + l]);
                store(wi + at, zi[4 * r + l]);
            }
        }
    }
}
#endif

// Radix 2 over pairs of 4-point transforms; tw = cos[4], sin[4] of -2 pi k / 8.
void radix2Pass(const float* ir, const float* ii, float* orr, float* oi, int n, const float* tw) {
    const V wr = load<V>(tw), wi = load<V>(tw + 4);
    for (int b = 0; b < n; b += 8) {
        const V a0r = load<V>(ir + b), a0i = load<V>(ii + b);
        V tr, ti;
        cmul(load<V>(ir + b + 4), load<V>(ii + b + 4), wr, wi, tr, ti);
        store(orr + b, a0r + tr); store(oi + b, a0i + ti);
        store(orr + b + 4, a0r - tr); store(oi + b + 4, a0i - ti);
    }
}

// Memory lanes of a register: p on (Stride 4), or blocks of four lanes
// Stride apart.
template <class U, int Stride>
struct LanesAt {
    static U get(const float* p) {
#if ZOR_SIMD >= 1
        if constexpr (Stride != 4) return loadBlocks<U>(p, Stride);
#endif
        return load<U>(p);
    }
    static void put(float* p, U v) {
#if ZOR_SIMD >= 1
        if constexpr (Stride != 4) return storeBlocks(p, Stride, v);
#endif
        store(p, v);
    }
};

// One radix-4 butterfly over the four quarters of a sub-transform pair:
// x.re(j), x.im(j) read quarter j (residue j of the combined transform),
// out.re(j, v), out.im(j, v) take output quarter j.  The order of the steps
// keeps at most eight vectors live: t1 and t3 are combined at once, then
// the real outputs leave before the imaginary inputs come in.
template <class U, class Quarters, class Out>
inline void radix4(const Quarters& x, Out& out, U w1r, U w1i, U w2r, U w2i, U w3r, U w3i) {
    U t1r, t1i, t3r, t3i, t2r, t2i;
    cmul(x.re(1), x.im(1), w1r, w1i, t1r, t1i);
    cmul(x.re(3), x.im(3), w3r, w3i, t3r, t3i);
    const U s13r = t1r + t3r, s13i = t1i + t3i, d13r = t1r - t3r, d13i = t1i - t3i;
    cmul(x.re(2), x.im(2), w2r, w2i, t2r, t2i);
    const U a0r = x.re(0), a0i = x.im(0);
    const U s02r = a0r + t2r, d02r = a0r - t2r;
    out.re(0, s02r + s13r);
    out.re(2, s02r - s13r);
    out.re(1, d02r + d13i);
    out.re(3, d02r - d13i);
    const U s02i = a0i + t2i, d02i = a0i - t2i;
    out.im(0, s02i + s13i);
    out.im(2, s02i - s13i);
    out.im(1, d02i - d13r);
    out.im(3, d02i + d13r);
}

// The radix-4 butterfly on the lanes of U from p0 on, of the four quarters
// L apart.  In bit-reversed order the sub-transform of the odd quarter
// (residue 1) sits at offset 2L and that of residue 2 at offset L.
template <class U, int Stride = 4>
inline void butterfly4(const float* ir, const float* ii, float* orr, float* oi, int p0, int L,
                       U w1r, U w1i, U w2r, U w2i, U w3r, U w3i) {
    using M = LanesAt<U, Stride>;
    struct {
        const float *r, *i;
        int p0, L;
        int at(int j) const { return p0 + (j == 1 ? 2 * L : j == 2 ? L : j * L); }
        U re(int j) const { return M::get(r + at(j)); }
        U im(int j) const { return M::get(i + at(j)); }
    } in{ir, ii, p0, L};
    struct {
        float *r, *i;
        int p0, L;
        void re(int j, U v) { M::put(r + p0 + j * L, v); }
        void im(int j, U v) { M::put(i + p0 + j * L, v); }
    } out{orr, oi, p0, L};
    radix4(in, out, w1r, w1i, w2r, w2i, w3r, w3i);
}

// Row r (w1r, w1i, w2r, w2i, w3r, w3i) of a pass's twiddles for k, k+1, ...
// (k a multiple of 4): the table keeps four k per 24-float chunk, so a wide
// register takes its 16-byte pieces from successive chunks.
#if ZOR_SIMD >= 1
inline WideV twiddleRow(const float* tw, int r, int k) { return loadBlocks<WideV>(tw + 6 * k + 4 * r, 24); }

// The radix-4 butterflies WideV::kLanes lanes at a time.
void radix4Wide(const float* ir, const float* ii, float* orr, float* oi, int n, int L, const float* tw) {
    using U = WideV;
    for (int k = 0; k < L; k += U::kLanes) {  // each k's twiddles serve every base
        const U w1r = twiddleRow(tw, 0, k), w1i = twiddleRow(tw, 1, k), w2r = twiddleRow(tw, 2, k);
        const U w2i = twiddleRow(tw, 3, k), w3r = twiddleRow(tw, 4, k), w3i = twiddleRow(tw, 5, k);
        for (int base = 0; base < n; base += 4 * L)
            butterfly4(ir, ii, orr, oi, base + k, L, w1r, w1i, w2r, w2i, w3r, w3i);
    }
}

// Two radix-4 passes in one (L and 4L, 16L <= n): the sixteen points
// base + k + L j1 + 4L j (j1, j = 0 .. 3) depend on one another only, so
// they stay in registers between the passes, lanes over k.  tw1 and tw2 are
// the two passes' tables.
void radix16Wide(const float* ir, const float* ii, float* orr, float* oi, int n, int L, const float* tw1,
                 const float* tw2) {
    using U = WideV;
    // quarter res of a butterfly sits at offset (bit-reversed) slot[res]
    static constexpr int kSlot[4] = {0, 2, 1, 3};
    for (int k = 0; k < L; k += U::kLanes) {
        // the twiddles of k, gathered once for every base
        U w1[6], w2[4][6];
        for (int r = 0; r < 6; ++r) {
            w1[r] = twiddleRow(tw1, r, k);
            for (int q = 0; q < 4; ++q) w2[q][r] = twiddleRow(tw2, r, k + L * q);
        }
        for (int base = 0; base < n; base += 16 * L) {
            const int p = base + k;
            U yr[4][4], yi[4][4];  // [j][q]: after the first pass, point p + L q + 4L j
            for (int j = 0; j < 4; ++j) {
                struct {
                    const float *r, *i;
                    int at;
                    int L;
                    U re(int res) const { return load<U>(r + at + kSlot[res] * L); }
                    U im(int res) const { return load<U>(i + at + kSlot[res] * L); }
                } x{ir, ii, p + 4 * L * j, L};
                struct {
                    U *r, *i;
                    void re(int q, U v) { r[q] = v; }
                    void im(int q, U v) { i[q] = v; }
                } out{yr[j], yi[j]};
                radix4(x, out, w1[0], w1[1], w1[2], w1[3], w1[4], w1[5]);
            }
            for (int q = 0; q < 4; ++q) {
                struct {
                    const U (*r)[4];
                    const U (*i)[4];
                    int q;
                    U re(int res) const { return r[kSlot[res]][q]; }
                    U im(int res) const { return i[kSlot[res]][q]; }
                } x{yr, yi, q};
                struct {
                    float *r, *i;
                    int at, L;
                    void re(int j, U v) { store(r + at + 4 * L * j, v); }
                    void im(int j, U v) { store(i + at + 4 * L * j, v); }
                } out{orr, oi, p + L * q, L};
                const U* w = w2[q];
                radix4(x, out, w[0], w[1], w[2], w[3], w[4], w[5]);
            }
        }
    }
}

// Sub-transforms of four points: one twiddle chunk serves every group of
// sixteen points, and a wide register takes one group's four lanes per
// 16-byte block from successive groups.
void radix4FourWide(const float* ir, const float* ii, float* orr, float* oi, int n, const float* tw) {
    using U = WideV;
    const U w1r = loadBlocks<U>(tw, 0), w1i = loadBlocks<U>(tw + 4, 0), w2r = loadBlocks<U>(tw + 8, 0);
    const U w2i = loadBlocks<U>(tw + 12, 0), w3r = loadBlocks<U>(tw + 16, 0), w3i = loadBlocks<U>(tw + 20, 0);
    for (int p0 = 0; p0 < n; p0 += 4 * U::kLanes)
        butterfly4<U, 16>(ir, ii, orr, oi, p0, 4, w1r, w1i, w2r, w2i, w3r, w3i);
}
#endif

// Radix 4 over sub-transforms of length L (a multiple of 4).  tw holds, per
// four k, the lanes of w^k, w^2k, w^3k (re then im), w = exp(-2 pi i / 4L).
void radix4Pass(const float* ir, const float* ii, float* orr, float* oi, int n, int L,
                const float* tw) {
#if ZOR_SIMD >= 1
    if constexpr (WideV::kLanes > 4) {
        if (L == 4 && n >= 4 * WideV::kLanes) return radix4FourWide(ir, ii, orr, oi, n, tw);
    }
#endif
    if (L == 4) {  // one twiddle chunk serves every block: keep it in registers
        const V w1r = load<V>(tw), w1i = load<V>(tw + 4), w2r = load<V>(tw + 8), w2i = load<V>(tw + 12);
        const V w3r = load<V>(tw + 16), w3i = load<V>(tw + 20);
        for (int p0 = 0; p0 < n; p0 += 16) butterfly4(ir, ii, orr, oi, p0, 4, w1r, w1i, w2r, w2i, w3r, w3i);
        return;
    }
#if ZOR_SIMD >= 1
    if constexpr (WideV::kLanes > V::kLanes) {
        if (L >= WideV::kLanes) return radix4Wide(ir, ii, orr, oi, n, L, tw);
    }
#endif
    for (int base = 0; base < n; base += 4 * L) {
        const float* t = tw;
        for (int k = 0; k < L; k += 4, t += 24)
            butterfly4(ir, ii, orr, oi, base + k, L, load<V>(t), load<V>(t + 4), load<V>(t + 8), load<V>(t + 12),
                       load<V>(t + 16), load<V>(t + 20));
    }
}

void scaleArray(float* p, int n, float s) {
    const V v = set1<V>(s);
    int i = 0;
    for (; i + 4 <= n; i += 4) store(p + i, load<V>(p + i) * v);
    for (; i < n; ++i) p[i] *= s;
}

// ---- plan and tables -------------------------------------------------------

// Floats of pass twiddles for a complex engine of order m (m >= 4).
int64_t passTableFloats(int m) {
    int64_t total = (m & 1) ? 8 : 0;
    for (int64_t L = (m & 1) ? 8 : 4; L * 4 <= (int64_t(1) << m); L *= 4) total += 6 * L;
    return total;
}

void fillPassTables(float* tw, int m) {
    if (m & 1) {
        for (int k = 0; k < 4; ++k) {
            float c, s;
            unitRoot(k, 8, c, s);
            tw[k] = c;
            tw[4 + k] = -s;
        }
        tw += 8;
    }
    for (int64_t L = (m & 1) ? 8 : 4; L * 4 <= (int64_t(1) << m); L *= 4) {
        for (int64_t k = 0; k < L; k += 4, tw += 24)
            for (int j = 1; j <= 3; ++j)
                for (int l = 0; l < 4; ++l) {
                    float c, s;
                    unitRoot(j * (k + l), 4 * L, c, s);
                    tw[(j - 1) * 8 + l] = c;
                    tw[(j - 1) * 8 + 4 + l] = -s;
                }
    }
}

void fillBitReverse(int32_t* rev, int bits) {
    const int32_t n = int32_t(1) << bits;
    rev[0] = 0;
    for (int32_t i = 1; i < n; ++i) rev[i] = (rev[i >> 1] >> 1) | ((i & 1) << (bits - 1));
}

// Runs the complex engine of order m >= 4 (n = 2^m) from `in` into (dr, di),
// working in (wr, wi): the last pass writes the destination.
template <class In>
void runComplex(const FftSpec* s, const In& in, float* wr, float* wi, float* dr, float* di) {
    const int m = s->cOrder;
    const int n = 1 << m;
    const float* tw = s->passTw;
    int L = 4;
#if ZOR_SIMD >= 1
    if constexpr (WideV::kLanes > 4 && std::is_same_v<In, SplitInput>) {
        if (!(m & 1) && n >= 16 * WideV::kLanes) {
            firstTwoPasses<WideV>(in, wr, wi, n, s->bitReverse, tw);
            tw += 24;
            L = 16;
        } else if (n >= 4 * WideV::kLanes) {
            firstPass<WideV>(in, wr, wi, n, s->bitReverse);
        } else {
            firstPass<V>(in, wr, wi, n, s->bitReverse);
        }
    } else
#endif
    firstPass<V>(in, wr, wi, n, s->bitReverse);
    if (m & 1) {
        radix2Pass(wr, wi, wr, wi, n, tw);
        tw += 8;
        L = 8;
    }
    while (4 * L <= n) {
#if ZOR_SIMD >= 1
        // (Where the 32 registers of the widest column hold the sixteen
        // points; with 16 registers the spills cost what the pairing saves.)
        if constexpr (WideV::kLanes >= 16) {
            if (L >= WideV::kLanes && 64 * L <= n) {  // twiddles gathered for four groups or more
                const bool last = 16 * L == n;
                radix16Wide(wr, wi, last ? dr : wr, last ? di : wi, n, L, tw, tw + 6 * L);
                tw += 30 * L;
                L *= 16;
                continue;
            }
        }
#endif
        const bool last = 4 * L == n;
        radix4Pass(wr, wi, last ? dr : wr, last ? di : wi, n, L, tw);
        tw += 6 * L;
        L *= 4;
    }
}

// Reference-quality kernels for the shortest lengths (N <= 16), in double.
// cos(2 pi k / 16)
constexpr double kCos16[16] = {1.0, 0.9238795325112867, 0.7071067811865476, 0.3826834323650898,
                               0.0, -0.3826834323650898, -0.7071067811865476, -0.9238795325112867,
                               -1.0, -0.9238795325112867, -0.7071067811865476, -0.3826834323650898,
                               0.0, 0.3826834323650898, 0.7071067811865476, 0.9238795325112867};

// X[k] = sum x[t] exp(-2 pi i k t / n) for k = 0 .. kCount - 1; xi may be null (real input).
void directDft(const float* xr, const float* xi, int n, int kCount, double* outR, double* outI) {
    const int step = 16 / n;
    for (int k = 0; k < kCount; ++k) {
        double ar = 0, ai = 0;
        for (int t = 0; t < n; ++t) {
            const int e = (k * t) % n * step;
            const double c = kCos16[e], sn = kCos16[(e + 12) & 15];  // sin = cos(. - pi/2)
            const double vr = xr[t], vi = xi ? xi[t] : 0.0;
            ar += vr * c + vi * sn;
            ai += vi * c - vr * sn;
        }
        outR[k] = ar;
        outI[k] = ai;
    }
}

bool overlaps(const float* a, const float* b, int64_t n) {
    return a < b + n && b < a + n;
}

// Whether the passes may sweep p as work memory: in the wide columns a
// register that straddles two cache lines costs both per load and store,
// so a destination not aligned to the register gets the aligned work
// arrays (only the last pass then writes it).
bool wholeLines(const float* p) {
#if ZOR_SIMD >= 1
    if constexpr (WideV::kLanes > 4) return (reinterpret_cast<uintptr_t>(p) & (sizeof(WideV) - 1)) == 0;
#endif
    (void)p;
    return true;
}

Status forwardComplex(const FftSpec* s, bool scaled, const float* sr, const float* si, float* dr,
                      float* di, uint8_t* pBuffer) {
    const int order = s->order;
    const int n = 1 << order;
    if (order < 4) {
        double outR[8], outI[8];
        directDft(sr, si, n, n, outR, outI);
        const double f = scaled ? s->scale : 1.0;
        for (int k = 0; k < n; ++k) {
            dr[k] = static_cast<float>(outR[k]) * static_cast<float>(f);
            di[k] = static_cast<float>(outI[k]) * static_cast<float>(f);
        }
        return StatusOk;
    }
    const SplitInput in{sr, si};
    if (order > kSmallOrder) {
        uint8_t* own = nullptr;
        if (!pBuffer) {
            own = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(s->bufferSize)));
            if (!own) return StatusNoMemory;
            pBuffer = own;
        }
        float* w = reinterpret_cast<float*>((reinterpret_cast<uintptr_t>(pBuffer) + 31) & ~uintptr_t(31));
        runComplex(s, in, w, w + n, dr, di);
        mem::alignedFree(own);
    } else if (overlaps(sr, dr, n) || overlaps(sr, di, n) || overlaps(si, dr, n) ||
               overlaps(si, di, n) || !wholeLines(dr) || !wholeLines(di)) {
        alignas(64) float w[2 << kSmallOrder];
        runComplex(s, in, w, w + n, dr, di);
    } else {
        runComplex(s, in, dr, di, dr, di);
    }
    if (scaled) {
        scaleArray(dr, n, s->scale);
        scaleArray(di, n, s->scale);
    }
    return StatusOk;
}

// The spectrum from the half-length transform Z (zr, zi; m = N/2 values):
// X[k] = E + T, X[m-k] = conj(E - T) with E = (Z[k] + conj Z[m-k]) / 2,
// T = w^k (Z[k] - conj Z[m-k]) / 2i.  The sink takes bins k .. k+L-1 in
// lane order (up), bins m-k-L+1 .. m-k with lane l holding bin m-k-l (down),
// L = U::kLanes, and X[0], X[m], both real (ends).
template <class U, class Sink>
void recombine(const FftSpec* s, const float* zr, const float* zi, int m, Sink& out) {
    constexpr int kLast = U::kLanes - 1;
    const float* rc = s->realTwiddles;
    const float* rs = s->realTwiddles2;
    const U half = set1<U>(0.5f);
    for (int k = 1; k <= m / 2; k += U::kLanes) {
        const U ar = load<U>(zr + k), ai = load<U>(zi + k);
        const U br = reverseLanes(load<U>(zr + m - k - kLast)), bi = reverseLanes(load<U>(zi + m - k - kLast));
        // B = conj Z[m-k]: (br, -bi)
        const U er = half * (ar + br), ei = half * (ai - bi);
        const U dr = ar - br, di = ai + bi;
        const U c = load<U>(rc + k), sn = load<U>(rs + k);
        const U tr = c * di + sn * dr, ti = sn * di - c * dr;
        out.up(k, er + tr, ei + ti);
        out.down(m - k - kLast, er - tr, ti - ei);
    }
    const float r0 = zr[0], i0 = zi[0];
    out.ends(r0 + i0, r0 - i0, m);
}

// Writes the CCS layout.
struct CcsSink {
    float* dst;
    void up(int k, V re, V im) {
        store(dst + 2 * k, zipLo(re, im));
        store(dst + 2 * k + 4, zipHi(re, im));
    }
    void down(int k, V re, V im) { up(k, reverseLanes(re), reverseLanes(im)); }
    void ends(float x0, float xm, int m) {
        dst[0] = x0;
        dst[1] = 0.0f;
        dst[2 * m] = xm;
        dst[2 * m + 1] = 0.0f;
    }
};

// Writes the magnitudes of the bins, each the float nearest the double
// square root of re^2 + im^2 formed in double: the values the CCS output
// followed by the complex magnitude gives.
struct MagnitudeSink {
    float* mag;
#if ZOR_SIMD >= 2
    template <class U>
    static U magnitudes(U re, U im) {
        const auto norm = [](auto r, auto i) { return sqrt(r * r + i * i); };  // on doubles
        return narrowSat<float>(norm(widenLo(re), widenLo(im)), norm(widenHi(re), widenHi(im)));
    }
#else
    static V magnitudes(V re, V im) {
        alignas(16) float r[4], i[4], out[4];
        store(r, re);
        store(i, im);
        for (int l = 0; l < 4; ++l) {
            const double a = r[l], b = i[l];
            out[l] = toFloat(std::sqrt(toDouble(a * a + b * b)));
        }
        return load<V>(out);
    }
#endif
    static float magnitude(float x) {
        const double a = x;
        return toFloat(std::sqrt(toDouble(a * a + 0.0)));
    }
    template <class U>
    void up(int k, U re, U im) { store(mag + k, magnitudes(re, im)); }
    template <class U>
    void down(int k, U re, U im) { store(mag + k, reverseLanes(magnitudes(re, im))); }
    void ends(float x0, float xm, int m) {
        mag[0] = magnitude(x0);
        mag[m] = magnitude(xm);
    }
};

Status forwardReal(const FftSpec* s, const float* src, float* dst, uint8_t* pBuffer) {
    const int order = s->order;
    const int n = 1 << order;
    const bool scaled = s->forwardScaled != 0;
    if (order < 5) {
        double outR[9], outI[9];
        directDft(src, nullptr, n, n / 2 + 1, outR, outI);
        const float f = scaled ? s->scale : 1.0f;
        for (int k = 0; k <= n / 2; ++k) {
            dst[2 * k] = static_cast<float>(outR[k]) * f;
            dst[2 * k + 1] = static_cast<float>(outI[k]) * f;
        }
        dst[1] = 0.0f;
        if (n > 1) dst[n + 1] = 0.0f;
        return StatusOk;
    }
    const int m = n / 2;
    const PairInput in{src};
    if (order > kSmallOrder) {
        uint8_t* own = nullptr;
        if (!pBuffer) {
            own = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(s->bufferSize)));
            if (!own) return StatusNoMemory;
            pBuffer = own;
        }
        float* w = reinterpret_cast<float*>((reinterpret_cast<uintptr_t>(pBuffer) + 31) & ~uintptr_t(31));
        runComplex(s, in, w, w + m, w, w + m);
        CcsSink out{dst};
        recombine<V>(s, w, w + m, m, out);
        mem::alignedFree(own);
    } else {
        alignas(16) float w[1 << kSmallOrder];
        runComplex(s, in, w, w + m, w, w + m);
        CcsSink out{dst};
        recombine<V>(s, w, w + m, m, out);
    }
    if (scaled) scaleArray(dst, n + 2, s->scale);
    return StatusOk;
}

}  // namespace

// The magnitudes of the forward real transform without the CCS in between
// (for the filter bank's own transform): mag[0 .. N/2] as the transform
// followed by the complex magnitude would give them.  False, with nothing
// written, for the specs it does not cover (short, long or scaled ones).
// Not where the arithmetic runs on the x87 unit: there, values kept in its
// registers would skip the rounding to float that the CCS store makes.
bool realTransformMagnitudes(const void* pSpec, const float* src, float* mag) {
#if ZOR_X87_MATH
    (void)pSpec, (void)src, (void)mag;
    return false;
#else
    const FftSpec* s = static_cast<const FftSpec*>(pSpec);
    if (s->id != kIdReal || s->order < 5 || s->order > kSmallOrder || s->forwardScaled) return false;
    const int m = 1 << (s->order - 1);
    alignas(16) float w[1 << kSmallOrder];
    runComplex(s, PairInput{src}, w, w + m, w, w + m);
    MagnitudeSink out{mag};
#if ZOR_SIMD >= 2
    if constexpr (WideV::kLanes > 4) {
        if (m / 2 >= WideV::kLanes) {
            recombine<WideV>(s, w, w + m, m, out);
            return true;
        }
    }
#endif
    recombine<V>(s, w, w + m, m, out);
    return true;
#endif
}

namespace {

Status initSpec(void** ppSpec, int order, int flag, int hint, bool real) {
    if (!ppSpec) return StatusNullPointer;
    if (order < 0 || order > kMaxOrder) return StatusBadOrder;
    if (flag != 1 && flag != 2 && flag != 4 && flag != 8) return StatusBadFlag;
    const int m = real ? order - 1 : order;  // order of the complex engine
    const bool engine = real ? order >= 5 : order >= 4;
    const int64_t n = int64_t(1) << order;
    // Layout of the one block: record, bit-reversal table, pass twiddles,
    // real twiddles; each part starts on 32 bytes.
    auto up32 = [](int64_t b) { return (b + 31) & ~int64_t(31); };
    const int64_t head = up32(sizeof(FftSpec));
    const int64_t revBytes = engine ? up32((int64_t(1) << (m - 2)) * 4) : 0;
    const int64_t passBytes = engine ? up32(passTableFloats(m) * 4) : 0;
    const int64_t realCount = (real && engine) ? n / 4 + 4 : 0;
    const int64_t realBytes = up32(realCount * 4);
    const int64_t total = head + revBytes + passBytes + 2 * realBytes;
    const int64_t buffer = order > kSmallOrder ? (real ? n : 2 * n) * 4 + 64 : 0;
    // Sizes that the 32-bit record fields cannot express are as good as an
    // allocation failure.
    if (total > 0x7FFFFFFF || buffer > 0x7FFFFFFF) return StatusNoMemory;
    uint8_t* block = static_cast<uint8_t*>(mem::alignedAlloc(static_cast<uint32_t>(total)));
    if (!block) return StatusNoMemory;

    FftSpec* s = reinterpret_cast<FftSpec*>(block);
    std::memset(s, 0, sizeof(FftSpec));
    s->id = real ? kIdReal : kIdComplex;
    s->order = order;
    s->forwardScaled = (flag == 1 || flag == 4) ? 1 : 0;
    s->inverseScaled = (flag == 2 || flag == 4) ? 1 : 0;
    s->scale = flag == 4 ? static_cast<float>(1.0 / std::sqrt(static_cast<double>(n)))
             : flag == 8 ? 1.0f
                         : static_cast<float>(1.0 / static_cast<double>(n));
    s->hint = static_cast<uint32_t>(hint);
    s->bufferSize = static_cast<int32_t>(buffer);
    s->allocated = 1;
    s->cOrder = m;
    s->twiddles = kQuarterSine;
    if (engine) {
        int32_t* rev = reinterpret_cast<int32_t*>(block + head);
        fillBitReverse(rev, m - 2);
        s->bitReverse = rev;
        float* pass = reinterpret_cast<float*>(block + head + revBytes);
        fillPassTables(pass, m);
        s->passTw = pass;
        if (m > kSmallOrder) s->twiddles = pass;
        if (real) {
            float* rc = reinterpret_cast<float*>(block + head + revBytes + passBytes);
            float* rs = rc + realBytes / 4;
            for (int64_t k = 0; k < realCount; ++k) {
                float c, sn;
                unitRoot(k, n, c, sn);
                rc[k] = 0.5f * c;
                rs[k] = -0.5f * sn;
            }
            s->realTwiddles = rc;
            s->realTwiddles2 = rs;
        }
    }
    *ppSpec = s;
    return StatusOk;
}

Status freeSpec(void* pSpec, int32_t id) {
    if (!pSpec) return StatusNullPointer;
    FftSpec* s = static_cast<FftSpec*>(pSpec);
    if (s->id != id) return StatusContextMismatch;
    s->id = 0;  // a second free is then refused rather than releasing twice
    mem::alignedFree(s);
    return StatusOk;
}

Status complexCall(const float* sr, const float* si, float* dr, float* di, const void* pSpec,
                   uint8_t* pBuffer, bool inverse) {
    if (!pSpec) return StatusNullPointer;
    const FftSpec* s = static_cast<const FftSpec*>(pSpec);
    if (s->id != kIdComplex) return StatusContextMismatch;
    if (Status st = anyNull(sr, si, dr, di)) return st;
    // The inverse transform is the forward one on swapped parts.
    if (inverse) return forwardComplex(s, s->inverseScaled != 0, si, sr, di, dr, pBuffer);
    return forwardComplex(s, s->forwardScaled != 0, sr, si, dr, di, pBuffer);
}

}  // namespace

Status ZOR_CALL zorsFFTInitAlloc_C_32f(void** ppSpec, int order, int flag, int hint) {
    return initSpec(ppSpec, order, flag, hint, false);
}

Status ZOR_CALL zorsFFTInitAlloc_R_32f(void** ppSpec, int order, int flag, int hint) {
    return initSpec(ppSpec, order, flag, hint, true);
}

Status ZOR_CALL zorsFFTFree_C_32f(void* pSpec) { return freeSpec(pSpec, kIdComplex); }
Status ZOR_CALL zorsFFTFree_R_32f(void* pSpec) { return freeSpec(pSpec, kIdReal); }

Status ZOR_CALL zorsFFTFwd_CToC_32f(const float* pSrcRe, const float* pSrcIm, float* pDstRe,
                                    float* pDstIm, const void* pSpec, uint8_t* pBuffer) {
    return complexCall(pSrcRe, pSrcIm, pDstRe, pDstIm, pSpec, pBuffer, false);
}

Status ZOR_CALL zorsFFTInv_CToC_32f(const float* pSrcRe, const float* pSrcIm, float* pDstRe,
                                    float* pDstIm, const void* pSpec, uint8_t* pBuffer) {
    return complexCall(pSrcRe, pSrcIm, pDstRe, pDstIm, pSpec, pBuffer, true);
}

Status ZOR_CALL zorsFFTFwd_RToCCS_32f(const float* pSrc, float* pDst, const void* pSpec,
                                      uint8_t* pBuffer) {
    if (!pSpec) return StatusNullPointer;
    const FftSpec* s = static_cast<const FftSpec*>(pSpec);
    if (s->id != kIdReal) return StatusContextMismatch;
    if (Status st = anyNull(pSrc, pDst)) return st;
    return forwardReal(s, pSrc, pDst, pBuffer);
}

}}  // namespace zor::ZOR_NS
