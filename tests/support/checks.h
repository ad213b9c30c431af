// Argument checks as a table.
//
// A family's checks are rows against one valid call: each row replaces one
// or more arguments and names the status that must come back; the memory
// named by watch() must be left as it was by every failing row.  The valid
// call runs last and must not fail, which shows that each row failed for
// its own argument.
//
//     zt::expectChecks(z().zoriCopy_8u_C1R, {src, 8, dst, 8, ImageSize{8, 8}},
//                      {zt::watch(dst, 64)},
//                      zt::eachNull(),                                   // every pointer: -8
//                      zt::bad(StatusBadSize, zt::arg<4>(ImageSize{0, 1})),
//                      zt::bad(StatusNullPointer, zt::arg<0>(nullptr),   // order: null first
//                              zt::arg<4>(ImageSize{0, 0})));
//
// Vector exports: zt::badLength<I>() stands for the two rows that set the
// length, argument I, to 0 and to -1 (StatusBadSize); image exports:
// zt::badRoi<I>() for the rows that set the ImageSize argument I to a width
// and to a height of 0 (StatusBadSize).
#pragma once

#include <gtest/gtest.h>

#include <cstddef>
#include <cstring>
#include <string>
#include <tuple>
#include <type_traits>
#include <utility>
#include <vector>

#include "zor.h"

namespace zt {

// Memory that a failing call must not touch.
struct Watch {
    const void* p;
    size_t bytes;
};
inline Watch watch(const void* p, size_t bytes) { return {p, bytes}; }
template <class T>
Watch watch(const std::vector<T>& v) { return {v.data(), v.size() * sizeof(T)}; }

// Argument I replaced by value.
template <size_t I, class V>
struct Arg {
    V value;
};
template <size_t I, class V>
Arg<I, V> arg(V value) { return {value}; }

// A row: the replacements and the status they must give.
template <class... A>
struct Bad {
    Status expected;
    std::tuple<A...> args;
};
template <class... A>
Bad<A...> bad(Status expected, A... args) { return {expected, {args...}}; }

// A row for each pointer argument in turn set to null, expecting `expected`
// (StatusNullPointer unless given); `allowed` lists pointer arguments that
// may be null.
struct EachNull {
    Status expected;
    std::vector<size_t> allowed;
};
inline EachNull eachNull(Status expected = StatusNullPointer, std::vector<size_t> allowed = {}) {
    return {expected, std::move(allowed)};
}

// Rows setting length argument I to 0 and to -1: StatusBadSize.
template <size_t I>
struct BadLength {};
template <size_t I>
BadLength<I> badLength() { return {}; }

// Rows setting ImageSize argument I to {0, 1} and to {1, 0}: StatusBadSize.
template <size_t I>
struct BadRoi {};
template <size_t I>
BadRoi<I> badRoi() { return {}; }

template <class T>
struct Same { using type = T; };

namespace detail {

template <class Tuple, size_t I, class V>
void apply(Tuple& t, const Arg<I, V>& a) {
    std::get<I>(t) = static_cast<std::tuple_element_t<I, Tuple>>(a.value);
}

struct Snapshot {
    explicit Snapshot(const std::vector<Watch>& w) : watches(w) {
        for (const Watch& x : w) {
            const auto* b = static_cast<const uint8_t*>(x.p);
            copies.emplace_back(b, b + x.bytes);
        }
    }
    bool intact() const {
        for (size_t k = 0; k < watches.size(); ++k)
            if (std::memcmp(watches[k].p, copies[k].data(), watches[k].bytes) != 0) return false;
        return true;
    }
    std::vector<Watch> watches;
    std::vector<std::vector<uint8_t>> copies;
};

template <class Fn, class Tuple>
void expectRow(Fn fn, const std::vector<Watch>& outs, Status expected, const Tuple& call,
               const std::string& row) {
    const Snapshot before(outs);
    const Status got = std::apply(fn, call);
    EXPECT_EQ(got, expected) << row;
    EXPECT_TRUE(before.intact()) << row << ": a failing call wrote to its output";
}

template <class Fn, class Tuple, class... A>
void run(Fn fn, const Tuple& good, const std::vector<Watch>& outs, const Bad<A...>& b, int index) {
    Tuple call = good;
    std::apply([&](const auto&... a) { (apply(call, a), ...); }, b.args);
    expectRow(fn, outs, b.expected, call, "row " + std::to_string(index));
}

template <size_t I, class Fn, class Tuple>
void nullRow(Fn fn, const Tuple& good, const std::vector<Watch>& outs, const EachNull& e, int index) {
    if constexpr (std::is_pointer_v<std::tuple_element_t<I, Tuple>>) {
        for (size_t a : e.allowed)
            if (a == I) return;
        Tuple call = good;
        std::get<I>(call) = nullptr;
        expectRow(fn, outs, e.expected, call,
                  "row " + std::to_string(index) + " (argument " + std::to_string(I) + " null)");
    }
}

template <class Fn, class Tuple, size_t... I>
void nullRows(Fn fn, const Tuple& good, const std::vector<Watch>& outs, const EachNull& e, int index,
              std::index_sequence<I...>) {
    (nullRow<I>(fn, good, outs, e, index), ...);
}

template <class Fn, class Tuple>
void run(Fn fn, const Tuple& good, const std::vector<Watch>& outs, const EachNull& e, int index) {
    nullRows(fn, good, outs, e, index, std::make_index_sequence<std::tuple_size_v<Tuple>>{});
}

template <class Fn, class Tuple, size_t I>
void run(Fn fn, const Tuple& good, const std::vector<Watch>& outs, BadRoi<I>, int index) {
    for (ImageSize roi : {ImageSize{0, 1}, ImageSize{1, 0}}) {
        Tuple call = good;
        std::get<I>(call) = roi;
        expectRow(fn, outs, StatusBadSize, call,
                  "row " + std::to_string(index) + " (roi " + std::to_string(roi.width) + "x" +
                      std::to_string(roi.height) + ")");
    }
}

template <class Fn, class Tuple, size_t I>
void run(Fn fn, const Tuple& good, const std::vector<Watch>& outs, BadLength<I>, int index) {
    for (int len : {0, -1}) {
        Tuple call = good;
        std::get<I>(call) = len;
        expectRow(fn, outs, StatusBadSize, call, "row " + std::to_string(index) + " (length " + std::to_string(len) + ")");
    }
}

}  // namespace detail

// Runs every row against fn (see above), then the valid call, which must
// return a status that is not an error.
template <class R, class... P, class... Rows>
void expectChecks(R(ZOR_CALL* fn)(P...), typename Same<std::tuple<P...>>::type good,
                  const std::vector<Watch>& outs, const Rows&... rows) {
    static_assert(std::is_same_v<R, Status>, "checks of Status-returning exports");
    int index = 0;
    (detail::run(fn, good, outs, rows, index++), ...);
    const Status ok = std::apply(fn, good);
    EXPECT_GE(ok, 0) << "the valid call of the check table failed";
}

}  // namespace zt
