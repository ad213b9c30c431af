// Every variant against the generic one.
//
// agreesWithGeneric(variant, run) calls run(api, c) once with the generic
// entries and once with the variant's, for a series of cases: vector
// lengths and image sizes that straddle register widths, buffers shifted off
// alignment and pressed against protected pages.  A case hands out inputs
// (random, the same for both runs) and outputs (pre-filled, then compared
// byte for byte, padding included); run returns the status, which must
// agree too.
//
//     zt::agreesWithGeneric(variant(), [](const zt::Api& z, zt::Case& c) {
//         const auto src = c.inImage<uint8_t>(c.roi().width * 3, c.roi().height);
//         const auto dst = c.outImage<uint8_t>(c.roi().width * 3, c.roi().height);
//         return z.zoriRGBToYCbCr_8u_C3R(src.p, src.step, dst.p, dst.step, c.roi());
//     });
#pragma once

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <memory>
#include <random>
#include <string>
#include <type_traits>
#include <vector>

#include "tests/support/guarded.h"
#include "tests/support/variants.h"
#include "zor.h"

namespace zt {

template <class T>
struct ImageBuf {
    T* p;      // first pixel of the ROI
    int step;  // bytes
};

// Random lanes: floats over [-1000, 1000], anything else (integers,
// complex integers) random bits.
template <class T>
void fillRandom(T* p, size_t n, std::mt19937& rng) {
    if constexpr (std::is_floating_point_v<T>) {
        std::uniform_real_distribution<double> d(-1000.0, 1000.0);
        for (size_t i = 0; i < n; ++i) p[i] = static_cast<T>(d(rng));
    } else {
        auto* b = reinterpret_cast<uint8_t*>(p);
        for (size_t i = 0; i < n * sizeof(T); i += 4) {
            const uint32_t bits = rng();
            std::memcpy(b + i, &bits, n * sizeof(T) - i < 4 ? n * sizeof(T) - i : 4);
        }
    }
}

// Floats with the specials mixed in: NaN, infinities, signed zeros and
// denormals among ordinary values.
std::vector<float> randomFloats(size_t n, uint32_t seed, float scale = 1000.0f, bool specials = false);

template <class T>
bool sameBits(const T& a, const T& b) { return std::memcmp(&a, &b, sizeof(T)) == 0; }

class Case {
public:
    Case(int index, int len, ImageSize roi, int shift) : index_(index), len_(len), roi_(roi), shift_(shift),
                                                         rng_(0x5eed + 7919u * unsigned(index)) {}

    int index() const { return index_; }
    int len() const { return len_; }            // vector length
    ImageSize roi() const { return roi_; }      // image ROI size
    int shift() const { return shift_; }        // elements every buffer starts off alignment
    std::mt19937& rng() { return rng_; }        // seeded by the case: the same in both runs

    // count random elements (fillRandom), or uniform over [lo, hi].
    template <class T>
    T* in(size_t count) { return randomIn<T>(count, false); }
    template <class T>
    T* in(size_t count, double lo, double hi) {
        T* p = alloc<T>(count, false);
        if constexpr (std::is_floating_point_v<T>) {
            std::uniform_real_distribution<double> d(lo, hi);
            for (size_t i = 0; i < count; ++i) p[i] = static_cast<T>(d(rng_));
        } else {
            std::uniform_int_distribution<int64_t> d(static_cast<int64_t>(lo), static_cast<int64_t>(hi));
            for (size_t i = 0; i < count; ++i) p[i] = static_cast<T>(d(rng_));
        }
        return p;
    }
    // A copy of v (built from rng(), say zt::randomFloats(n, c.rng()())).
    template <class T>
    T* in(const std::vector<T>& v) { return copyOf(v, false); }
    // count elements compared after the call (pre-filled with a pattern).
    template <class T>
    T* out(size_t count) { return alloc<T>(count, true); }
    // Inputs compared after the call too: in-place exports.
    template <class T>
    T* inOut(size_t count) { return randomIn<T>(count, true); }
    template <class T>
    T* inOut(const std::vector<T>& v) { return copyOf(v, true); }
    // Floats over [-scale, scale], NaN, infinities, signed zeros and
    // denormals mixed in (one NaN pattern: which operand's NaN an operation
    // keeps is the processor's business).
    std::vector<float> floats(size_t count, float scale = 1000.0f) {
        return randomFloats(count, rng_(), scale, true);
    }

    // Images of `elems` elements a row (pixels times channels), rows padded
    // to a step that is no multiple of 16 bytes.
    template <class T>
    ImageBuf<T> inImage(int elems, int rows) {
        const int step = stepFor<T>(elems);
        T* p = alloc<T>(bytesFor(step, elems * int(sizeof(T)), rows) / sizeof(T), false);
        fillRandom(p, bytesFor(step, elems * int(sizeof(T)), rows) / sizeof(T), rng_);
        return {p, step};
    }
    template <class T>
    ImageBuf<T> outImage(int elems, int rows) {
        const int step = stepFor<T>(elems);
        return {alloc<T>(bytesFor(step, elems * int(sizeof(T)), rows) / sizeof(T), true), step};
    }

    // What the run left in its outputs.
    std::vector<uint8_t> outputs() const;

private:
    template <class T>
    int stepFor(int elems) const {
        return (elems + 1 + index_ % 3) * int(sizeof(T));
    }
    static size_t bytesFor(int step, int rowBytes, int rows) {
        return static_cast<size_t>(step) * (rows - 1) + rowBytes;
    }
    template <class T>
    T* randomIn(size_t count, bool output) {
        T* p = alloc<T>(count, output);
        fillRandom(p, count, rng_);
        return p;
    }
    template <class T>
    T* copyOf(const std::vector<T>& v, bool output) {
        T* p = alloc<T>(v.size(), output);
        if (!v.empty()) std::memcpy(p, v.data(), v.size() * sizeof(T));
        return p;
    }
    template <class T>
    T* alloc(size_t count, bool output) {
        const size_t bytes = (count + shift_) * sizeof(T);
        buffers_.push_back(std::make_unique<GuardedBuffer>(bytes));
        uint8_t* d = buffers_.back()->data();
        if (output) {
            for (size_t i = 0; i < bytes; ++i) d[i] = static_cast<uint8_t>(0xA5 ^ (i * 7));
            outputs_.push_back(buffers_.size() - 1);
        }
        return reinterpret_cast<T*>(d + shift_ * sizeof(T));
    }

    int index_, len_;
    ImageSize roi_;
    int shift_;
    std::mt19937 rng_;
    std::vector<std::unique_ptr<GuardedBuffer>> buffers_;
    std::vector<size_t> outputs_;
};

// The cases: lengths around 1, 4, 8, 16, 32 and 64 lanes and a longer one;
// image sizes from 1 x 1 to past two registers a row; shifts 0 to 3.
int caseCount();
Case makeCase(int index);

// run(const Api&, Case&) -> Status (or any integer) for every case: the
// variant's outputs and status must equal the generic entries' bit for bit
// (or another reference variant's, where the generic one cannot serve).
template <class Run>
void agreesWithGeneric(int variant, Run run, int reference = 0) {
    if (variant == reference) return;
    for (int k = 0; k < caseCount(); ++k) {
        Case g = makeCase(k), v = makeCase(k);
        const auto sg = run(api(reference), g);
        const auto sv = run(api(variant), v);
        const ImageSize r = g.roi();
        const std::string what = "case " + std::to_string(k) + ": len " + std::to_string(g.len()) + ", roi " +
                                 std::to_string(r.width) + "x" + std::to_string(r.height) + ", shift " +
                                 std::to_string(g.shift());
        ASSERT_EQ(sv, sg) << what;
        const std::vector<uint8_t> og = g.outputs(), ov = v.outputs();
        ASSERT_EQ(og.size(), ov.size()) << what;
        size_t first = 0;
        while (first < og.size() && og[first] == ov[first]) ++first;
        ASSERT_EQ(first, og.size()) << what << ": outputs differ from byte " << first;
    }
}

}  // namespace zt
