// The lane vocabulary against scalar oracles lane by lane, at the width of
// the column this copy is compiled for (simd_cases.h): nothing here names a
// width, so the per-16-byte-block operations are checked against their lane
// indices block by block.
#include "frame/variant.h"
#include "frame/simd.h"
#include "tests/frame/simd_cases.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <random>
#include <vector>

namespace {
using namespace zor::simd;

template <class T>
std::vector<T> randomLanes(std::mt19937& rng, int n) {
    std::vector<T> v(n);
    for (auto& x : v) {
        const uint64_t bits = (uint64_t(rng()) << 32) | rng();
        std::memcpy(&x, &bits, sizeof(T));
        if (rng() % 8 == 0) x = T(rng() % 3);  // ties and small values
    }
    return v;
}

template <class V>
std::vector<typename V::Lane> lanesIn(V v) {
    std::vector<typename V::Lane> out(V::kLanes);
    store(out.data(), v);
    return out;
}

template <class T>
bool sameBits(T a, T b) { return std::memcmp(&a, &b, sizeof(T)) == 0; }

// Every lane i of got has the bits of want(i).
template <class V, class Want>
void expectLanes(V got, Want want, const char* what) {
    const auto g = lanesIn(got);
    for (int i = 0; i < V::kLanes; ++i)
        ASSERT_TRUE(sameBits(g[i], typename V::Lane(want(i)))) << what << ", lane " << i << " of " << V::kLanes;
}

// op over whole registers (and the tail) equals op on each lane.
template <class T, class Op>
void agreesLaneByLane(Op op, const char* what) {
    std::mt19937 rng(7);
    const int n = 9 * Vec<T>::kLanes + 1;  // two cache lines of registers, one more register, a tail
    for (int round = 0; round < 50; ++round) {
        const auto a = randomLanes<T>(rng, n), b = randomLanes<T>(rng, n);
        std::vector<T> got(n);
        mapLanes(a.data(), b.data(), got.data(), n, op);
        for (int i = 0; i < n; ++i)
            ASSERT_TRUE(sameBits(got[i], T(op(a[i], b[i])))) << what << " lane " << i << " of " << sizeof(T) * 8 << "-bit";
    }
}

template <class T>
void lanewiseOps() {
    agreesLaneByLane<T>([](auto a, auto b) { return min(a, b); }, "min");
    agreesLaneByLane<T>([](auto a, auto b) { return max(a, b); }, "max");
    agreesLaneByLane<T>([](auto a, auto b) { return select(gt(a, b), a, b); }, "gt");
    agreesLaneByLane<T>([](auto a, auto b) { return select(ge(a, b), b, a); }, "ge");
    agreesLaneByLane<T>([](auto a, auto b) { return select(le(a, b), a, b); }, "le");
    if constexpr (std::is_integral_v<T>) {
        agreesLaneByLane<T>([](auto a, auto) { return shr<3>(a); }, "shr");
        agreesLaneByLane<T>([](auto a, auto) { return shl<5>(a); }, "shl");
        agreesLaneByLane<T>([](auto a, auto b) { return asLanes<decltype(a)>(lt(a, b)); }, "asLanes");
        agreesLaneByLane<T>([](auto a, auto) { return a | set1<decltype(a)>(T(0x41)); }, "set1");
    } else {
        agreesLaneByLane<T>([](auto a, auto b) { return a * b + b; }, "mul, add");
    }
    if constexpr (std::is_integral_v<T> && sizeof(T) >= 2) {
        agreesLaneByLane<T>([](auto a, auto) { return shr(a, 5); }, "shr by count");
        agreesLaneByLane<T>([](auto a, auto) { return shl(a, 3); }, "shl by count");
    }
    if constexpr (std::is_integral_v<T> && sizeof(T) <= 2) {
        agreesLaneByLane<T>([](auto a, auto b) { return addSat(a, b); }, "addSat");
        agreesLaneByLane<T>([](auto a, auto b) { return subSat(a, b); }, "subSat");
    }
    if constexpr (std::is_signed_v<T>) agreesLaneByLane<T>([](auto a, auto) { return abs(a); }, "abs");
}

void LanewiseOperationsMatchTheirScalarTwins() {
    lanewiseOps<uint8_t>(), lanewiseOps<int8_t>(), lanewiseOps<uint16_t>(), lanewiseOps<int16_t>();
    lanewiseOps<uint32_t>(), lanewiseOps<int32_t>();
    lanewiseOps<float>(), lanewiseOps<double>();  // NaNs among the lanes: min/max keep the second operand
    agreesLaneByLane<uint8_t>([](auto a, auto b) { return avg(a, b); }, "avg");
    agreesLaneByLane<uint16_t>([](auto a, auto b) { return absDiff(a, b); }, "absDiff");
    agreesLaneByLane<uint32_t>([](auto a, auto b) { return a * b; }, "mul");
    agreesLaneByLane<int16_t>([](auto a, auto b) { return mulHiRound(a, b); }, "mulHiRound");
    // the scalar twin of abs clears the sign bit like the register form
    EXPECT_FALSE(std::signbit(abs(-0.0f)));
    EXPECT_FALSE(std::signbit(abs(-std::numeric_limits<float>::quiet_NaN())));
}

// ---- lane sizes changing --------------------------------------------------------

template <class To, class From>
To saturated(From x) {
    if constexpr (std::is_floating_point_v<To>) return To(x);
    else return To(x < From(std::numeric_limits<To>::min()) ? std::numeric_limits<To>::min()
                   : x > From(std::numeric_limits<To>::max()) ? std::numeric_limits<To>::max() : x);
}

// Widening per 16-byte block and in order, from registers and from memory.
template <class T>
void widens(std::mt19937& rng) {
    using W = Wider<T>;
    constexpr int n = Vec<T>::kLanes, per = 16 / sizeof(T), perW = per / 2;
    const auto a = randomLanes<T>(rng, n);
    const Vec<T> v = load<Vec<T>>(a.data());
    const auto block = [&](int i, int half) { return W(a[i / perW * per + half * perW + i % perW]); };
    expectLanes(widenLo(v), [&](int i) { return block(i, 0); }, "widenLo");
    expectLanes(widenHi(v), [&](int i) { return block(i, 1); }, "widenHi");
    expectLanes(widenLoInOrder(v), [&](int i) { return W(a[i]); }, "widenLoInOrder");
    expectLanes(widenHiInOrder(v), [&](int i) { return W(a[n / 2 + i]); }, "widenHiInOrder");
    expectLanes(loadWidened<Vec<W>>(a.data()), [&](int i) { return W(a[i]); }, "loadWidened");
}

// Narrowing with saturation (doubles: rounding) per block and in order.
template <class To, class From>
void narrows(std::mt19937& rng) {
    constexpr int n = Vec<From>::kLanes, per = 16 / sizeof(From);
    auto lo = randomLanes<From>(rng, n), hi = randomLanes<From>(rng, n);
    if constexpr (std::is_floating_point_v<From>)  // mostly in float range
        for (int i = 0; i < n; i += 2) lo[i] = From(float(i) * 1e3f / 7), hi[i] = -lo[i] * From(1.1);
    const Vec<From> l = load<Vec<From>>(lo.data()), h = load<Vec<From>>(hi.data());
    const auto inOrder = [&](int i) { return saturated<To>(i < n ? lo[i] : hi[i - n]); };
    const auto perBlock = [&](int i) {
        const int b = i / (2 * per), j = i % (2 * per);
        return saturated<To>(j < per ? lo[b * per + j] : hi[b * per + j - per]);
    };
    expectLanes(narrowSat<To>(l, h), perBlock, "narrowSat");
    expectLanes(narrowSatInOrder<To>(l, h), inOrder, "narrowSatInOrder");
    if constexpr (std::is_same_v<From, double>) expectLanes(narrowInOrder<float>(l, h), inOrder, "narrowInOrder");
}

void WideningAndNarrowingKeepTheirLaneOrder() {
    std::mt19937 rng(3);
    for (int round = 0; round < 20; ++round) {
        widens<int8_t>(rng), widens<uint8_t>(rng), widens<int16_t>(rng), widens<uint16_t>(rng);
        widens<int32_t>(rng), widens<float>(rng);
        narrows<int8_t, int16_t>(rng), narrows<uint8_t, int16_t>(rng), narrows<int16_t, int32_t>(rng);
        narrows<uint16_t, int32_t>(rng), narrows<uint8_t, uint16_t>(rng), narrows<float, double>(rng);
    }
}

// ---- per 16-byte block ------------------------------------------------------------

// Lane i of a register of T lanes: block i / per, place i % per.
template <class T>
constexpr int kPer = 16 / int(sizeof(T));

template <class T>
void zips(std::mt19937& rng) {
    const auto a = randomLanes<T>(rng, Vec<T>::kLanes), b = randomLanes<T>(rng, Vec<T>::kLanes);
    const Vec<T> va = load<Vec<T>>(a.data()), vb = load<Vec<T>>(b.data());
    constexpr int per = kPer<T>;
    const auto zip = [&](int i, int half) {
        const int from = i / per * per + half * per / 2 + i % per / 2;
        return i % 2 ? b[from] : a[from];
    };
    expectLanes(zipLo(va, vb), [&](int i) { return zip(i, 0); }, "zipLo");
    expectLanes(zipHi(va, vb), [&](int i) { return zip(i, 1); }, "zipHi");
    if constexpr (sizeof(T) == 4) {
        // a's lanes 0 2 (1 3), then b's; the 4 x 4 transpose of four registers
        const auto pick = [&](int i, int odd) {
            const int j = i % 4, base = i / 4 * 4;
            return j < 2 ? a[base + 2 * j + odd] : b[base + 2 * (j - 2) + odd];
        };
        expectLanes(concatEven(va, vb), [&](int i) { return pick(i, 0); }, "concatEven");
        expectLanes(concatOdd(va, vb), [&](int i) { return pick(i, 1); }, "concatOdd");
        Vec<T> r[4] = {va, vb, zipLo(va, vb), zipHi(va, vb)};
        std::vector<T> rows[4];
        for (int k = 0; k < 4; ++k) rows[k] = lanesIn(r[k]);
        transpose4(r[0], r[1], r[2], r[3]);
        for (int k = 0; k < 4; ++k)
            expectLanes(r[k], [&](int i) { return rows[i % 4][i / 4 * 4 + k]; }, "transpose4");
    }
}

void BlockwiseOperationsFollowTheirLaneIndices() {
    std::mt19937 rng(5);
    using B = Vec<uint8_t>;
    constexpr int nb = B::kLanes;
    for (int round = 0; round < 20; ++round) {
        zips<uint8_t>(rng), zips<int16_t>(rng), zips<int32_t>(rng), zips<float>(rng), zips<double>(rng);
        const auto x = randomLanes<uint8_t>(rng, nb), y = randomLanes<uint8_t>(rng, nb);
        const B vx = load<B>(x.data()), vy = load<B>(y.data());
        const auto at = [](int i, int k) { return i / 16 * 16 + k; };  // byte k of lane i's block
        expectLanes(alignBytes<5>(vy, vx), [&](int i) { return i % 16 < 11 ? x[i + 5] : y[at(i, i % 16 - 11)]; }, "alignBytes");
        expectLanes(shiftBytesUp<3>(vx), [&](int i) { return i % 16 >= 3 ? x[i - 3] : 0; }, "shiftBytesUp");
        expectLanes(shiftBytesDown<3>(vx), [&](int i) { return i % 16 < 13 ? x[i + 3] : 0; }, "shiftBytesDown");
#if ZOR_SIMD >= 4
        expectLanes(shuffleBytes(vx, vy), [&](int i) { return y[i] & 0x80 ? 0 : x[at(i, y[i] & 15)]; }, "shuffleBytes");
        expectLanes(mulAddPairs(vx, bitcast<int8_t>(vy)), [&](int i) {
            return saturated<int16_t>(x[2 * i] * int8_t(y[2 * i]) + x[2 * i + 1] * int8_t(y[2 * i + 1]));
        }, "mulAddPairs of bytes");
#endif
        // 16-bit pairs: only two products of -32768 by -32768 wrap (to INT_MIN)
        auto s = randomLanes<int16_t>(rng, nb / 2), t = randomLanes<int16_t>(rng, nb / 2);
        s[0] = s[1] = t[0] = t[1] = -32768;
        expectLanes(mulAddPairs(load<Vec<int16_t>>(s.data()), load<Vec<int16_t>>(t.data())),
                    [&](int i) { return int32_t(uint32_t(s[2 * i] * t[2 * i]) + uint32_t(s[2 * i + 1] * t[2 * i + 1])); },
                    "mulAddPairs");
        // neighbouring lanes summed, a's pairs then b's in each block
        const auto u = randomLanes<int32_t>(rng, nb / 4), w = randomLanes<int32_t>(rng, nb / 4);
        using I = Vec<int32_t>;
        expectLanes(addPairs(load<I>(u.data()), load<I>(w.data())), [&](int i) {
            const auto& src = i % 4 < 2 ? u : w;
            const int k = i / 4 * 4 + 2 * (i % 2);
            return int32_t(uint32_t(src[k]) + uint32_t(src[k + 1]));
        }, "addPairs");
        std::vector<double> p(nb / 8), q(nb / 8);
        for (int i = 0; i < nb / 8; ++i) p[i] = 0.25 * int(rng() % 1000), q[i] = -0.5 * int(rng() % 1000);
        using D = Vec<double>;
        expectLanes(addPairs(load<D>(p.data()), load<D>(q.data())),
                    [&](int i) { return (i % 2 ? q : p)[i / 2 * 2] + (i % 2 ? q : p)[i / 2 * 2 + 1]; }, "addPairs");
    }
}

// ---- blocks, lookups, masks, sums --------------------------------------------------

void BlocksGathersMasksAndSums() {
    using I = Vec<int32_t>;
    using D = Vec<double>;
    constexpr int n = I::kLanes, blocks = n / 4;
    // blocks of four lanes from p + 7 b and back
    std::vector<int32_t> spread(7 * blocks + 4), back(7 * blocks + 4, -1);
    for (size_t i = 0; i < spread.size(); ++i) spread[i] = int32_t(i);
    const I v = loadBlocks<I>(spread.data(), 7);
    expectLanes(v, [](int i) { return i / 4 * 7 + i % 4; }, "loadBlocks");
    storeBlocks(back.data(), 7, v);
    for (size_t i = 0; i < back.size(); ++i) EXPECT_EQ(back[i], i % 7 < 4 && i / 7 < blocks ? int32_t(i) : -1) << i;
    int seen = 0;
    eachBlock(v, [&](int b, Vec<int32_t, 16> r) {
        EXPECT_EQ(b, seen++);
        expectLanes(r, [&](int i) { return 7 * b + i; }, "eachBlock");
    });
    EXPECT_EQ(seen, blocks);
    // lookups: in order from indices in memory; per block, lanes 0 1 (Lo) and 2 3 (Hi)
    double table[64];
    for (int i = 0; i < 64; ++i) table[i] = 0.5 * i;
    std::vector<int32_t> idx(n);
    for (int i = 0; i < n; ++i) idx[i] = (37 * i + 11) % 63;
    const I vi = load<I>(idx.data());
    const auto at = [&](int i, int half) { return idx[i / 2 * 4 + 2 * half + i % 2]; };
    expectLanes(gather<D>(table, idx.data()), [&](int i) { return 0.5 * idx[i]; }, "gather");
    expectLanes(gatherLo(table, vi), [&](int i) { return 0.5 * at(i, 0); }, "gatherLo");
    expectLanes(gatherHi(table, vi), [&](int i) { return 0.5 * at(i, 1); }, "gatherHi");
    for (int half = 0; half < 2; ++half) {
        D first, second;
        if (half) gatherRowsHi(table, idx.data(), first, second);
        else gatherRowsLo(table, idx.data(), first, second);
        expectLanes(first, [&](int i) { return 0.5 * at(i, half); }, "gatherRows, first");
        expectLanes(second, [&](int i) { return 0.5 * (at(i, half) + 1); }, "gatherRows, second");
    }
    // masks with one lane set, at every lane
    const auto oneLane = [](auto tag) {
        using V = Vec<decltype(tag)>;
        using T = typename V::Lane;
        std::vector<T> ramp(V::kLanes);
        for (int i = 0; i < V::kLanes; ++i) ramp[i] = T(i);
        const V r = load<V>(ramp.data());
        EXPECT_TRUE(!anyTrue(zero<V>()) && firstTrue(zero<V>()) == V::kLanes && allTrue(eq(r, r)));
        for (int k = 0; k < V::kLanes; ++k) {
            const V m = eq(r, set1<V>(T(k)));
            ASSERT_TRUE(anyTrue(m) && !allTrue(m) && firstTrue(m) == k) << sizeof(T) << "-byte lane " << k;
        }
    };
    oneLane(int8_t()), oneLane(int16_t()), oneLane(int32_t()), oneLane(float()), oneLane(double());
    // float sums halve: lane i + n/2 added to lane i (left), until one is left
    std::mt19937 rng(9);
    using F = Vec<float>;
    for (int round = 0; round < 20; ++round) {
        std::vector<float> f(F::kLanes);
        for (auto& x : f) x = std::ldexp(float(int(rng() % 2001) - 1000), int(rng() % 40) - 20);
        std::vector<float> s = f;
        for (int m = F::kLanes / 2; m >= 1; m /= 2)
            for (int i = 0; i < m; ++i) s[i] = s[i] + s[i + m];
        ASSERT_TRUE(sameBits(reduceAdd(load<F>(f.data())), s[0])) << round;
    }
}

// ---- lane order over the whole register -------------------------------------------

template <class T>
void reversesLanes() {
    using V = Vec<T>;
    T in[V::kLanes];
    for (int i = 0; i < V::kLanes; ++i) in[i] = T(i + 1);
    expectLanes(reverseLanes(load<V>(in)), [&](int i) { return in[V::kLanes - 1 - i]; }, "reverseLanes");
    if constexpr (sizeof(T) < 8 || std::is_floating_point_v<T>) {
        EXPECT_EQ(getLane<1>(load<V>(in)), in[1]);
        EXPECT_EQ(getLane<V::kLanes - 1>(load<V>(in)), in[V::kLanes - 1]);
    }
}

// The even/odd split of a run of two registers, its inverse, the transpose
// of a square of registers, three interleaved byte channels.
void WholeRegisterLaneOrder() {
    reversesLanes<uint8_t>(), reversesLanes<int16_t>(), reversesLanes<uint32_t>();
    reversesLanes<uint64_t>(), reversesLanes<float>(), reversesLanes<double>();
    using V = Vec<float>;
    constexpr int n = V::kLanes;
    float run[2 * n], sq[n * n];
    for (int i = 0; i < n * n; ++i) sq[i] = float(i);
    std::memcpy(run, sq, sizeof run);
    V e, o, lo, hi, rows[n];
    deinterleave(load<V>(run), load<V>(run + n), e, o);
    expectLanes(e, [&](int i) { return run[2 * i]; }, "deinterleave, even");
    expectLanes(o, [&](int i) { return run[2 * i + 1]; }, "deinterleave, odd");
    interleave(e, o, lo, hi);
    expectLanes(lo, [&](int i) { return run[i]; }, "interleave");
    expectLanes(hi, [&](int i) { return run[n + i]; }, "interleave");
    for (int i = 0; i < n; ++i) rows[i] = load<V>(sq + i * n);
    transpose(rows);
    for (int i = 0; i < n; ++i) expectLanes(rows[i], [&](int j) { return sq[j * n + i]; }, "transpose");
    using B = Vec<uint8_t>;
    uint8_t block[3 * B::kLanes], back[3 * B::kLanes];
    for (int i = 0; i < 3 * B::kLanes; ++i) block[i] = uint8_t(7 * i + 3);
    B planes[3];
    loadInterleaved3(block, planes[0], planes[1], planes[2]);
    for (int c = 0; c < 3; ++c) expectLanes(planes[c], [&](int i) { return block[3 * i + c]; }, "loadInterleaved3");
    storeInterleaved3(back, planes[0], planes[1], planes[2]);
    EXPECT_EQ(0, std::memcmp(back, block, sizeof block));
}

}  // namespace

namespace zt { namespace ZOR_INLINE_NS {
#define ZT_SIMD_CASE_ENTRY(name) &name,
extern const SimdCases simdCases;
const SimdCases simdCases = {ZT_SIMD_CASES(ZT_SIMD_CASE_ENTRY)};
}}  // namespace zt::ZOR_INLINE_NS
