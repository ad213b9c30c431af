// The lane vocabulary against its scalar twins, compiled as the SSE2 column
// (where most operations are emulated) and run on random lanes.
#include "frame/variant.h"
#include "frame/simd.h"

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
            ASSERT_EQ(got[i], op(a[i], b[i])) << what << " lane " << i << " of " << sizeof(T) * 8 << "-bit";
    }
}

template <class T>
void integerOps() {
    agreesLaneByLane<T>([](auto a, auto b) { return min(a, b); }, "min");
    agreesLaneByLane<T>([](auto a, auto b) { return max(a, b); }, "max");
    agreesLaneByLane<T>([](auto a, auto b) { return select(gt(a, b), a, b); }, "gt");
    agreesLaneByLane<T>([](auto a, auto b) { return select(ge(a, b), b, a); }, "ge");
    agreesLaneByLane<T>([](auto a, auto b) { return select(le(a, b), a, b); }, "le");
    agreesLaneByLane<T>([](auto a, auto) { return shr<3>(a); }, "shr");
    agreesLaneByLane<T>([](auto a, auto) { return shl<5>(a); }, "shl");
    agreesLaneByLane<T>([](auto a, auto b) { return asLanes<decltype(a)>(lt(a, b)); }, "asLanes");
    agreesLaneByLane<T>([](auto a, auto) { return a | set1<decltype(a)>(T(0x41)); }, "set1");
    if constexpr (sizeof(T) >= 2) {
        agreesLaneByLane<T>([](auto a, auto) { return shr(a, 5); }, "shr by count");
        agreesLaneByLane<T>([](auto a, auto) { return shl(a, 3); }, "shl by count");
    }
    if constexpr (sizeof(T) <= 2) {
        agreesLaneByLane<T>([](auto a, auto b) { return addSat(a, b); }, "addSat");
        agreesLaneByLane<T>([](auto a, auto b) { return subSat(a, b); }, "subSat");
    }
    if constexpr (std::is_signed_v<T>) agreesLaneByLane<T>([](auto a, auto) { return abs(a); }, "abs");
}

TEST(SimdLanes, IntegerOperationsMatchTheirScalarTwins) {
    integerOps<uint8_t>();
    integerOps<int8_t>();
    integerOps<uint16_t>();
    integerOps<int16_t>();
    integerOps<uint32_t>();
    integerOps<int32_t>();
    agreesLaneByLane<uint8_t>([](auto a, auto b) { return avg(a, b); }, "avg");
    agreesLaneByLane<uint16_t>([](auto a, auto b) { return absDiff(a, b); }, "absDiff");
    agreesLaneByLane<uint32_t>([](auto a, auto b) { return a * b; }, "mul");
    agreesLaneByLane<int16_t>([](auto a, auto b) { return mulHiRound(a, b); }, "mulHiRound");  // emulated
}

TEST(SimdLanes, WidenThenNarrowRestoresOrderAndSaturates) {
    std::mt19937 rng(3);
    const auto a = randomLanes<int32_t>(rng, 8);
    using V = Vec<int32_t>;
    const auto u16 = narrowSat<uint16_t>(load<V>(a.data()), load<V>(a.data() + 4));
    const auto s16 = narrowSat<int16_t>(load<V>(a.data()), load<V>(a.data() + 4));
    uint16_t gotU[8];
    int16_t gotS[8];
    store(gotU, u16);
    store(gotS, s16);
    for (int i = 0; i < 8; ++i) {
        EXPECT_EQ(gotU[i], a[i] < 0 ? 0 : a[i] > 65535 ? 65535 : a[i]) << i;
        EXPECT_EQ(gotS[i], a[i] < -32768 ? -32768 : a[i] > 32767 ? 32767 : a[i]) << i;
    }
    const auto bytes = randomLanes<int8_t>(rng, 16);
    const auto v = load<Vec<int8_t>>(bytes.data());
    int8_t back[16];
    store(back, narrowSat<int8_t>(widenLo(v), widenHi(v)));
    EXPECT_EQ(0, std::memcmp(back, bytes.data(), 16));
    int16_t wide[8];
    store(wide, widenHi(v));
    for (int i = 0; i < 8; ++i) EXPECT_EQ(wide[i], bytes[8 + i]);
}

TEST(SimdLanes, FloatReductionOrderAndSelect) {
    const float l[4] = {1e8f, 1.0f, -1e8f, 1.0f};
    // (l0 + l2) + (l1 + l3) = 2; left to right would give 1
    EXPECT_EQ(reduceAdd(load<Vec<float>>(l)), 2.0f);
    const float nan = std::numeric_limits<float>::quiet_NaN();
    const float x[4] = {nan, -0.0f, 3.0f, -2.0f}, y[4] = {1.0f, 0.0f, nan, 5.0f};
    float got[4];
    store(got, min(load<Vec<float>>(x), load<Vec<float>>(y)));
    for (int i = 0; i < 4; ++i) EXPECT_EQ(std::memcmp(&got[i], &y[i] , 4) == 0, i != 3) << i;
    store(got, abs(load<Vec<float>>(x)));
    EXPECT_TRUE(got[0] != got[0]);
    EXPECT_EQ(got[3], 2.0f);
}

// Lane order over the whole register: the even/odd split of a run of two
// registers, its inverse, and the transpose of a square of registers.
TEST(SimdLanes, DeinterleaveInterleaveAndTransposeKeepLaneOrder) {
    using V = Vec<float>;
    constexpr int n = V::kLanes;
    float run[2 * n], sq[n * n], even[n], odd[n];
    for (int i = 0; i < n * n; ++i) sq[i] = float(i);
    std::memcpy(run, sq, sizeof run);
    V e, o, lo, hi, rows[n];
    deinterleave(load<V>(run), load<V>(run + n), e, o);
    store(even, e);
    store(odd, o);
    for (int i = 0; i < n; ++i) EXPECT_TRUE(even[i] == run[2 * i] && odd[i] == run[2 * i + 1]) << i;
    interleave(e, o, lo, hi);
    store(run, lo);
    store(run + n, hi);
    for (int i = 0; i < 2 * n; ++i) EXPECT_EQ(run[i], float(i));
    for (int i = 0; i < n; ++i) rows[i] = load<V>(sq + i * n);
    transpose(rows);
    for (int i = 0; i < n; ++i) {
        store(even, rows[i]);
        for (int j = 0; j < n; ++j) EXPECT_EQ(even[j], sq[j * n + i]) << i << " " << j;
    }
}

TEST(SimdLanes, InterleavedThreeChannelsAndPairSums) {
    uint8_t block[48], back[48];
    for (int i = 0; i < 48; ++i) block[i] = uint8_t(7 * i + 3);
    Vec<uint8_t> a, b, c;
    loadInterleaved3(block, a, b, c);
    uint8_t planes[3][16];
    store(planes[0], a), store(planes[1], b), store(planes[2], c);
    for (int i = 0; i < 48; ++i) ASSERT_EQ(planes[i % 3][i / 3], block[i]) << i;
    storeInterleaved3(back, a, b, c);
    EXPECT_EQ(0, std::memcmp(back, block, 48));
    const int32_t x[4] = {1, -2, 1 << 30, 5}, y[4] = {7, 8, -9, 10};
    int32_t got[4];
    store(got, addPairs(load<Vec<int32_t>>(x), load<Vec<int32_t>>(y)));
    EXPECT_EQ(std::vector<int32_t>(got, got + 4), (std::vector<int32_t>{-1, (1 << 30) + 5, 15, 1}));
}

// Lane order operations against the lane indices they promise.
template <class T>
void reversesLanes() {
    using V = Vec<T>;
    T in[V::kLanes], out[V::kLanes];
    for (int i = 0; i < V::kLanes; ++i) in[i] = T(i + 1);
    store(out, reverseLanes(load<V>(in)));
    for (int i = 0; i < V::kLanes; ++i) EXPECT_EQ(out[i], in[V::kLanes - 1 - i]) << sizeof(T) << "-byte lane " << i;
    if constexpr (sizeof(T) < 8 || std::is_floating_point_v<T>) {
        EXPECT_EQ(getLane<1>(load<V>(in)), in[1]);
    }
}

TEST(SimdLanes, LaneOrderAndAccess) {
    reversesLanes<uint8_t>();
    reversesLanes<int16_t>();
    reversesLanes<uint32_t>();
    reversesLanes<uint64_t>();
    reversesLanes<float>();
    reversesLanes<double>();
    const int32_t a[4] = {0, 1, 2, 3}, b[4] = {4, 5, 6, 7};
    using V = Vec<int32_t>;
    int32_t got[4];
    store(got, concatEven(load<V>(a), load<V>(b)));
    EXPECT_EQ(got[0] + 10 * got[1] + 100 * got[2] + 1000 * got[3], 0 + 20 + 400 + 6000);
    store(got, concatOdd(load<V>(a), load<V>(b)));
    EXPECT_EQ(got[0] + 10 * got[1] + 100 * got[2] + 1000 * got[3], 1 + 30 + 500 + 7000);
    V r[4];
    for (int k = 0; k < 4; ++k) r[k] = set1<V>(k) + load<V>(a) * set1<V>(4);  // r[k][l] = 4 l + k
    transpose4(r[0], r[1], r[2], r[3]);
    for (int k = 0; k < 4; ++k) {
        store(got, r[k]);
        for (int l = 0; l < 4; ++l) EXPECT_EQ(got[l], 4 * k + l);
    }
    const int16_t m[8] = {0, 0, 0, -1, 0, -1, 0, 0};
    const auto mask = load<Vec<int16_t>>(m);
    EXPECT_EQ(firstTrue(mask), 3);
    EXPECT_EQ(firstTrue(zero<Vec<int16_t>>()), 8);
    EXPECT_TRUE(anyTrue(mask) && !allTrue(mask) && allTrue(eq(mask, mask)));
    const double p[2] = {1.5, -2.0}, q[2] = {0.25, 8.0};
    EXPECT_EQ(getLane<1>(addPairs(load<Vec<double>>(p), load<Vec<double>>(q))), 8.25);
    EXPECT_EQ(getLane<0>(alignBytes<8>(load<Vec<double>>(q), load<Vec<double>>(p))), -2.0);
    uint8_t bytes[32], shifted[16];
    for (int i = 0; i < 32; ++i) bytes[i] = uint8_t(i);
    using B = Vec<uint8_t>;
    store(shifted, alignBytes<5>(load<B>(bytes + 16), load<B>(bytes)));
    for (int i = 0; i < 16; ++i) EXPECT_EQ(shifted[i], 5 + i);
}

// Lookups take lanes 0, 1 (Lo) and 2, 3 (Hi) of each 16-byte block, like
// toDoubleLo/toDoubleHi; rows give their first and second doubles.
TEST(SimdLanes, TableLookupsFollowTheWideningOrder) {
    double table[64];
    for (int i = 0; i < 64; ++i) table[i] = 0.5 * i;
    using I = Vec<int32_t>;
    using D = Vec<double>;
    const int32_t idx[4] = {9, 0, 63, 20};
    const I v = load<I>(idx);
    double got[4];
    store(got, gatherLo(table, v));
    store(got + 2, gatherHi(table, v));
    for (int l = 0; l < 4; ++l) EXPECT_EQ(got[l], 0.5 * idx[l]) << l;
    // in order, indices from memory
    store(got, gather<D>(table, idx + 1));
    for (int l = 0; l < D::kLanes; ++l) EXPECT_EQ(got[l], 0.5 * idx[l + 1]) << l;
    const int32_t rows[4] = {40, 2, 62, 11};
    D first, second;
    gatherRowsLo(table, rows, first, second);
    store(got, first);
    store(got + 2, second);
    gatherRowsHi(table, rows, first, second);
    double hi[4];
    store(hi, first);
    store(hi + 2, second);
    for (int l = 0; l < 2; ++l) {
        EXPECT_EQ(got[l], 0.5 * rows[l]) << l;
        EXPECT_EQ(got[2 + l], 0.5 * (rows[l] + 1)) << l;
        EXPECT_EQ(hi[l], 0.5 * rows[2 + l]) << l;
        EXPECT_EQ(hi[2 + l], 0.5 * (rows[2 + l] + 1)) << l;
    }
}

TEST(SimdLanes, LoadWidenedExtendsInOrder) {
    const int8_t s[8] = {-128, -1, 0, 1, 127, -2, 5, -7};
    int16_t w[8];
    store(w, loadWidened<Vec<int16_t>>(s));
    for (int i = 0; i < 8; ++i) EXPECT_EQ(w[i], s[i]);
    const uint8_t u[8] = {255, 128, 0, 1, 2, 3, 4, 200};
    store(w, loadWidened<Vec<int16_t>>(u));
    for (int i = 0; i < 8; ++i) EXPECT_EQ(w[i], u[i]);
    const float f[2] = {0.1f, -3e38f};
    double d[2];
    store(d, loadWidened<Vec<double>>(f));
    EXPECT_EQ(d[0], double(f[0]));
    EXPECT_EQ(d[1], double(f[1]));
    const float g[4] = {1.5f, -0.0f, 3e-39f, 7.25f};
    using Dv = Vec<double>;
    float back[4];
    store(back, narrowInOrder<float>(loadWidened<Dv>(g), loadWidened<Dv>(g + Dv::kLanes)));
    EXPECT_EQ(std::memcmp(back, g, sizeof g), 0);
    // the scalar twin of abs clears the sign bit like the register form
    const float negZero = abs(-0.0f);
    EXPECT_FALSE(std::signbit(negZero));
    EXPECT_FALSE(std::signbit(abs(-std::numeric_limits<float>::quiet_NaN())));
}

}  // namespace
