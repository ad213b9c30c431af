// Times the benchmark's workloads on zor alone, through the
// entries of chosen code variants, without a peer and without the benchmark
// framework: the same program builds for x86-64 and for 32-bit Windows, so
// the two builds of the library can be compared workload by workload.
//
//   zor_variant_bench [--variants 4,1,0] [--reps 5] [--filter text|text...]
//       (on x86-64 columns 5 and 6 are the AVX2 and AVX-512 ones)
//       prints one line per measurement: "workload<TAB>variant<TAB>ns".
//   zor_variant_bench --table <x86-64 lines> <32-bit lines>
//       pairs the medians of two such outputs into a table with the ratio
//       32-bit / x86-64 (and, for the variants other than 4, the ratio to
//       variant 4 of the same build).
//
// The workloads repeat the zor side of every workload of bench/bench_*.cpp
// (same exports, sizes and arguments; where the benchmark prepares its
// input with OpenCV, an input of the same kind made here), each a few lines
// on one of the shapes below.
#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <functional>
#include <map>
#include <memory>
#include <sstream>
#include <string>
#include <vector>

#include "bench/picture_pixels.h"
#include "frame/attach.h"
#include "frame/column_api.h"
#include "frame/dispatch.h"
#include "zor.h"

namespace {

using Api = zor::dispatch::ColumnApi;
using zor::dispatch::columnApi;

// Keeps the compiler from dropping a result.
volatile uint32_t gSink;
template <class T>
void keep(const T& v) {
    uint32_t w = 0;
    std::memcpy(&w, &v, std::min(sizeof v, sizeof w));
    gSink = gSink + w;
}

// A buffer on a 64-byte boundary, as the benchmark's peers allocate theirs:
// the C runtimes of the two builds align plain allocations differently
// (16 bytes on x86-64, 8 on 32-bit Windows), which would otherwise time
// split stores on one side only.
template <class T>
class Buffer {
public:
    explicit Buffer(size_t n, T fill = T()) : raw_(n * sizeof(T) + 64), p_(aligned()) { std::fill(p_, p_ + n, fill); }
    Buffer(const T* v, size_t n) : raw_(n * sizeof(T) + 64), p_(aligned()) { std::copy(v, v + n, p_); }
    explicit Buffer(const std::vector<T>& v) : Buffer(v.data(), v.size()) {}
    Buffer(const Buffer&) = delete;
    Buffer& operator=(const Buffer&) = delete;
    T* data() { return p_; }
    const T* data() const { return p_; }
    T& operator[](size_t i) { return p_[i]; }
    const T& operator[](size_t i) const { return p_[i]; }

private:
    T* aligned() { return reinterpret_cast<T*>((reinterpret_cast<uintptr_t>(raw_.data()) + 63) & ~uintptr_t(63)); }
    std::vector<unsigned char> raw_;
    T* p_;
};
template <class T>
std::shared_ptr<Buffer<T>> buffer(size_t n, T fill = T()) { return std::make_shared<Buffer<T>>(n, fill); }
template <class T>
std::shared_ptr<Buffer<T>> buffer(const std::vector<T>& v) { return std::make_shared<Buffer<T>>(v); }

std::vector<float> randomFloats(size_t n, uint32_t seed, float lo, float hi) {
    std::vector<float> v(n);
    uint32_t r = seed * 2654435761u + 1;
    for (float& x : v) {
        r = r * 1664525u + 1013904223u;
        x = lo + (hi - lo) * float(r >> 8) / float(1u << 24);
    }
    return v;
}
template <class T>
std::vector<T> randomInts(size_t n, uint32_t seed) {
    std::vector<T> v(n);
    uint32_t r = seed * 2654435761u + 1;
    for (T& x : v) {
        r = r * 1664525u + 1013904223u;
        x = T(r >> 16);
    }
    return v;
}

template <class T>
const T* as(const uint8_t* p) { return reinterpret_cast<const T*>(p); }
template <class T>
T* as(uint8_t* p) { return reinterpret_cast<T*>(p); }

// ---- inputs and outputs, shared by all workloads ------------------------------
// The inputs are built once and never written; each workload that changes its
// picture works on a copy of its own.  Every output goes to one scratch
// buffer (the workloads run one at a time).

constexpr int kW = 1920, kH = 1080, kB = 8;  // border: enough for a 15 x 15 box
constexpr ImageSize kRoi{kW, kH};
constexpr int kLen = 64 * 1024;

// An input picture: the first pixel of the ROI and the row step in bytes.
struct Picture {
    const uint8_t* p;
    int step;
};

// The benchmarks' test picture (bench/picture.h) with a replicated border.
struct Padded {
    static constexpr int step = kW + 2 * kB;
    Buffer<uint8_t> pixels = Buffer<uint8_t>(size_t(step) * (kH + 2 * kB));
    Padded() {
        std::vector<uint8_t> plain(size_t(kW) * kH);
        zb::fillTestPicture(plain.data(), kW, kH, kW);
        for (int y = -kB; y < kH + kB; ++y)
            for (int x = -kB; x < kW + kB; ++x)
                pixels[size_t(y + kB) * step + (x + kB)] =
                    plain[size_t(std::min(kH - 1, std::max(0, y))) * kW + std::min(kW - 1, std::max(0, x))];
    }
};
const Padded& padded() {
    static const Padded p;
    return p;
}
Picture gray() { return {padded().pixels.data() + size_t(kB) * Padded::step + kB, Padded::step}; }

// Random bytes enough for a four-channel picture; noise(c, k) is the k-th
// such picture seen with c channels.
template <int Channels, int Which = 0>
Picture noise() {
    static const Buffer<uint8_t> bytes(randomInts<uint8_t>(size_t(kW) * kH * 4, 11 + Which));
    return {bytes.data(), kW * Channels};
}
// The same bytes as a three-channel picture with a border of kB pixels.
Picture noiseWithBorder() {
    const int step = (kW + 2 * kB) * 3;
    return {noise<3>().p + kB * step + kB * 3, step};
}
// The test picture / 16 in float, and three 16-bit channels derived from it.
Picture real() {
    static const Buffer<float> f = [] {
        std::vector<float> v(size_t(kW) * kH);
        for (int y = 0; y < kH; ++y)
            for (int x = 0; x < kW; ++x) v[size_t(y) * kW + x] = gray().p[size_t(y) * gray().step + x] / 16.0f;
        return Buffer<float>(v.data(), v.size());
    }();
    return {reinterpret_cast<const uint8_t*>(f.data()), kW * 4};
}
Picture rgb16() {
    static const Buffer<uint16_t> w = [] {
        std::vector<uint16_t> v(size_t(kW) * kH * 3);
        uint32_t r = 777;
        for (int y = 0; y < kH; ++y)
            for (int x = 0; x < 3 * kW; ++x) {
                r = r * 1664525u + 1013904223u;
                v[size_t(y) * 3 * kW + x] = uint16_t(gray().p[size_t(y) * gray().step + x / 3] * (200 + 25 * (x % 3)) + (r >> 24));
            }
        return Buffer<uint16_t>(v.data(), v.size());
    }();
    return {reinterpret_cast<const uint8_t*>(w.data()), kW * 6};
}

// The outputs: room for the largest (2880 x 1620 x 3 bytes).
uint8_t* out() {
    static Buffer<uint8_t> b(16u << 20);
    return b.data();
}

// 64 Ki-element vectors.
struct Signals {
    Buffer<float> a{randomFloats(kLen, 1, -1, 1)}, b{randomFloats(kLen, 2, -1, 1)};
    Buffer<float> wide{randomFloats(2 * kLen, 1, -100, 100)}, positive{randomFloats(kLen, 1, 1e-3f, 1e3f)};
    Buffer<float> spread{randomFloats(kLen, 1, -1e6f, 1e6f)}, ramp{kLen};
    Buffer<int16_t> s1{randomInts<int16_t>(kLen, 1)}, s2{randomInts<int16_t>(kLen, 2)}, ramp16{kLen};
    Signals() {
        for (int i = 0; i < kLen; ++i) {
            ramp[i] = float(std::sin(i * 0.001) * 40000.0);
            ramp16[i] = int16_t(std::sin(i * 0.001) * 32000.0);
        }
    }
};
Signals& signals() {
    static Signals s;
    return s;
}

// Frees a library object when the last timed call holding it is gone.
template <class T, class Free>
std::shared_ptr<T> owned(T* p, Free freeFn) {
    return std::shared_ptr<T>(p, [freeFn](T* q) { if (q) freeFn(q); });
}

// ---- workload shapes ---------------------------------------------------------

using Call = std::function<void()>;
using Prepare = std::function<Call(const Api&)>;

// A workload: prepares its data for one variant and returns the timed call.
struct Workload {
    const char* name;
    Prepare prepare;
};

// A picture in, kW x kH pixels of `dstBytes` bytes out.
using ImageFn = void (*)(const Api&, Picture src, uint8_t* dst, int dstStep);
Prepare image(Picture (*src)(), int dstBytes, ImageFn fn) {
    return [=](const Api& z) -> Call {
        const Picture s = src();
        uint8_t* d = out();
        return [&z, s, d, dstBytes, fn] {
            fn(z, s, d, kW * dstBytes);
            keep(d[7]);
        };
    };
}

// Vectors in, a vector out.
using SignalFn = void (*)(const Api&, Signals& in, uint8_t* dst);
Prepare signal(SignalFn fn) {
    return [=](const Api& z) -> Call {
        Signals& in = signals();
        uint8_t* d = out();
        return [&z, &in, d, fn] {
            fn(z, in, d);
            keep(d[5]);
        };
    };
}

// A call with nothing prepared but the variant's entries.
using PlainFn = void (*)(const Api&);
Prepare plain(PlainFn fn) {
    return [=](const Api& z) -> Call { return [&z, fn] { fn(z); }; };
}

// Resizes a whole picture of T to dw x dh.
template <class T>
using ResizeFn = Status(ZOR_CALL*)(const T*, ImageSize, int, ImageRect, T*, int, ImageSize, double, double, int);
template <class T, ResizeFn<T> Api::*Fn>
Prepare resize(Picture (*src)(), int dw, int dh, int mode) {
    return [=](const Api& z) -> Call {
        const Picture s = src();
        T* d = reinterpret_cast<T*>(out());
        const int dstStep = dw * (s.step / kW);
        return [&z, s, d, dstStep, dw, dh, mode] {
            (z.*Fn)(reinterpret_cast<const T*>(s.p), {kW, kH}, s.step, {0, 0, kW, kH}, d, dstStep, {dw, dh},
                    double(dw) / kW, double(dh) / kH, mode);
            keep(d[7]);
        };
    };
}

// ---- workloads with state of their own -----------------------------------------

template <int Order>
Call fftC(const Api& z) {
    const int n = 1 << Order;
    void* spec = nullptr;
    z.zorsFFTInitAlloc_C_32f(&spec, Order, 8, 0);
    auto s = owned(spec, z.zorsFFTFree_C_32f);
    auto re = buffer(randomFloats(n, 1, -1, 1)), im = buffer(randomFloats(n, 2, -1, 1));
    float* d = as<float>(out());
    return [&z, s, re, im, d, n] {
        z.zorsFFTFwd_CToC_32f(re->data(), im->data(), d, d + n, s.get(), nullptr);
        keep(d[1]);
    };
}

template <int Order>
Call fftR(const Api& z) {
    const int n = 1 << Order;
    void* spec = nullptr;
    z.zorsFFTInitAlloc_R_32f(&spec, Order, 8, 0);
    auto s = owned(spec, z.zorsFFTFree_R_32f);
    auto x = buffer(randomFloats(n, 3, -1, 1));
    float* d = as<float>(out());
    return [&z, s, x, d] {
        z.zorsFFTFwd_RToCCS_32f(x->data(), d, s.get(), nullptr);
        keep(d[1]);
    };
}

// Forward (flag 8) or inverse (flag 2) transform of a W x H image.
template <int W, int H, bool Inverse>
Call dft2d(const Api& z) {
    void* spec = nullptr;
    z.zoriDFTInitAlloc_R_32f(&spec, {W, H}, Inverse ? 2 : 8, 0);
    auto s = owned(spec, z.zoriDFTFree_R_32f);
    auto x = buffer(randomFloats(size_t(W) * H, 9, -1, 1));
    float* d = as<float>(out());
    const auto run = Inverse ? z.zoriDFTInv_PackToR_32f_C1R : z.zoriDFTFwd_RToPack_32f_C1R;
    return [run, s, x, d] {
        run(x->data(), W * 4, d, W * 4, s.get(), nullptr);
        keep(d[1]);
    };
}

// The JPEG transform of every 8 x 8 block of the test picture.
Call jpegBlocks(const Api& z) {
    uint8_t raw[64];
    for (int i = 0; i < 64; ++i) raw[i] = uint8_t(1 + i % 23);
    auto table = buffer<uint16_t>(64);
    z.zoriQuantFwdTableInit_JPEG_8u16u(raw, table->data());
    const Picture s = gray();
    int16_t* d = as<int16_t>(out());
    return [&z, table, s, d] {
        int16_t* block = d;
        for (int y = 0; y < kH; y += 8)
            for (int x = 0; x < kW; x += 8, block += 64)
                z.zoriDCTQuantFwd8x8LS_JPEG_8u16s_C1R(s.p + size_t(y) * s.step + x, s.step, block, table->data());
        keep(d[1]);
    };
}

// Canny on the test picture's own Sobel derivatives.
Call canny(const Api& z) {
    static const std::pair<std::shared_ptr<Buffer<int16_t>>, std::shared_ptr<Buffer<int16_t>>> dxy = [&z] {
        auto dx = buffer<int16_t>(size_t(kW) * kH), dy = buffer<int16_t>(size_t(kW) * kH);
        z.zoriFilterSobelVert_8u16s_C1R(gray().p, gray().step, dx->data(), kW * 2, kRoi, 33);
        z.zoriFilterSobelHoriz_8u16s_C1R(gray().p, gray().step, dy->data(), kW * 2, kRoi, 33);
        return std::make_pair(dx, dy);
    }();
    int size = 0;
    z.zoriCannyGetSize(kRoi, &size);
    auto work = buffer<uint8_t>(size_t(size));
    uint8_t* d = out();
    return [&z, work, d] {
        z.zoriCanny_16s8u_C1R(dxy.first->data(), kW * 2, dxy.second->data(), kW * 2, d, kW, kRoi, 100.0f, 200.0f,
                              work->data());
        keep(d[7]);
    };
}

// A large background region (0) around scattered discs and bars (255).
const Buffer<uint8_t>& binaryScene() {
    static const Buffer<uint8_t> b = [] {
        std::vector<uint8_t> v(size_t(kW) * kH, 0);
        uint32_t r = 2024;
        auto next = [&](int n) { return int((r = r * 1664525u + 1013904223u) >> 8) % n; };
        auto paint = [&](int x0, int y0, int x1, int y1, int radius) {  // a box, or the disc inside it
            const int cx = (x0 + x1) / 2, cy = (y0 + y1) / 2;
            for (int y = std::max(0, y0); y <= std::min(kH - 1, y1); ++y)
                for (int x = std::max(0, x0); x <= std::min(kW - 1, x1); ++x)
                    if (radius == 0 || (x - cx) * (x - cx) + (y - cy) * (y - cy) <= radius * radius)
                        v[size_t(y) * kW + x] = 255;
        };
        for (int i = 0; i < 400; ++i) {
            const int cx = next(kW), cy = next(kH), radius = 3 + next(40);
            paint(cx - radius, cy - radius, cx + radius, cy + radius, radius);
        }
        for (int i = 0; i < 60; ++i) {
            const int x = next(kW), y = next(kH), w = 2 + next(200), h = 2 + next(6);
            paint(x, y, x + w - 1, y + h - 1, 0);
        }
        v[0] = 0;
        return Buffer<uint8_t>(v.data(), v.size());
    }();
    return b;
}

// Every call fills the same region: 0 -> 1, then 1 -> 0.
Call flood(const Api& z) {
    auto img = std::make_shared<Buffer<uint8_t>>(binaryScene().data(), size_t(kW) * kH);
    int size = 0;
    z.zoriFloodFillGetSize(kRoi, &size);
    auto work = buffer<uint8_t>(size_t(size));
    auto value = std::make_shared<uint8_t>(1);
    return [&z, img, work, value] {
        ConnectedComp region;
        z.zoriFloodFill_4Con_8u_C1IR(img->data(), kW, kRoi, {0, 0}, *value, &region, work->data());
        *value ^= 1;
        keep(region.area);
    };
}

// Gentle slopes with steps between them, filled from the centre on a fresh copy.
Call floodGradient(const Api& z) {
    static const Buffer<uint8_t> smooth = [] {
        std::vector<uint8_t> v(size_t(kW) * kH);
        for (int y = 0; y < kH; ++y)
            for (int x = 0; x < kW; ++x)
                v[size_t(y) * kW + x] = uint8_t((x / 7 + y / 5) % 200 + ((x / 240 + y / 180) % 3) * 20);
        return Buffer<uint8_t>(v.data(), v.size());
    }();
    int size = 0;
    z.zoriFloodFillGetSize_Grad(kRoi, &size);
    auto work = buffer<uint8_t>(size_t(size));
    uint8_t* d = out();
    return [&z, work, d] {
        std::memcpy(d, smooth.data(), size_t(kW) * kH);
        ConnectedComp region;
        z.zoriFloodFill_Grad4Con_8u_C1IR(d, kW, kRoi, {kW / 2, kH / 2}, 255, 1, 1, &region, work->data());
        keep(region.area);
    };
}

// Dilation in place, over and over, of a copy of the bordered test picture.
Call dilateInPlace(const Api& z) {
    auto img = std::make_shared<Buffer<uint8_t>>(padded().pixels.data(), size_t(Padded::step) * (kH + 2 * kB));
    return [&z, img] {
        uint8_t* roi = img->data() + size_t(kB) * Padded::step + kB;
        z.zoriDilate3x3_8u_C1IR(roi, Padded::step, kRoi);
        keep(roi[7]);
    };
}

Call mirrorInPlace(const Api& z) {
    auto img = buffer<uint8_t>(size_t(kW) * kH, 7);
    return [&z, img] { keep(z.zoriMirror_8u_C1IR(img->data(), kW, kRoi, 2)); };
}

// 1 min of 16 kHz audio to 13 cepstra per 25 ms frame, every 10 ms.
Call mfcc(const Api& z) {
    constexpr int kRate = 16000, kWin = 400, kHop = 160, kFft = 512, kFilters = 26, kCeps = 13;
    constexpr int kFrames = (60 * kRate - kWin) / kHop + 1;
    static const Buffer<float> audio = [] {
        std::vector<float> v = randomFloats(60 * kRate, 11, -0.2f, 0.2f);
        for (size_t i = 0; i < v.size(); ++i) v[i] += 0.3f * std::sin(0.05f * static_cast<float>(i % 6283));
        return Buffer<float>(v.data(), v.size());
    }();
    void *bank = nullptr, *lifter = nullptr;
    int order = 0;
    z.zorsMelFBankInitAlloc_32f(&bank, &order, kFft, kRate, 64, 8000, kFilters, 2595, 700, 1 | 4);
    z.zorsDCTLifterInitAlloc_32f(&lifter, kFilters, kCeps, 22, 1.0f);
    auto b = owned(bank, z.zorsFBankFree_32f), l = owned(lifter, z.zorsDCTLifterFree_32f);
    auto frame = buffer<float>(kFft), energies = buffer<float>(kFilters), window = buffer<float>(kWin);
    z.zorsSet_32f(1.0f, window->data(), kWin);
    z.zorsWinHamming_32f_I(window->data(), kWin);
    float* ceps = as<float>(out());
    return [&z, b, l, frame, energies, window, ceps] {
        float* f = frame->data();
        for (int k = 0; k < kFrames; ++k) {
            z.zorsCopy_32f(audio.data() + k * kHop, f, kWin);
            z.zorsPreemphasize_32f(f, kWin, 0.97f);
            z.zorsMul_32f_I(window->data(), f, kWin);
            z.zorsEvalFBank_32f(f, energies->data(), b.get());
            z.zorsThreshold_LTVal_32f_I(energies->data(), kFilters, 1e-10f, 1e-10f);
            z.zorsLn_32f_I(energies->data(), kFilters);
            z.zorsDCTLifter_32f(energies->data(), ceps + k * kCeps, l.get());
        }
        keep(ceps[1]);
    };
}

Call moments(const Api& z) {
    MomentState* state = nullptr;
    z.zoriMomentInitAlloc_64f(&state, 0);
    auto s = owned(state, z.zoriMomentFree_64f);
    return [&z, s] {
        z.zoriMoments64f_32f_C1R(as<float>(real().p), real().step, kRoi, s.get());
        keep(s->moments[0][0]);
    };
}

Call iir(const Api& z) {
    static const float taps[10] = {0.0048f, 0.0193f, 0.0289f, 0.0193f, 0.0048f,
                                   1.0f,    -2.3695f, 2.3140f, -1.0547f, 0.1874f};
    void* state = nullptr;
    z.zorsIIRInitAlloc_32f(&state, taps, 4, nullptr);
    auto s = owned(state, z.zorsIIRFree_32f);
    float* d = as<float>(out());
    return [&z, s, d] {
        z.zorsIIR_32f(signals().a.data(), d, kLen, s.get());
        keep(d[5]);
    };
}

Call randGauss(const Api& z) {
    void* state = nullptr;
    z.zorsRandGaussInitAlloc_32f(&state, 0.0f, 1.0f, 1234);
    auto s = owned(state, z.zorsRandGaussFree_32f);
    float* d = as<float>(out());
    return [&z, s, d] {
        z.zorsRandGauss_32f(d, kLen, s.get());
        keep(d[5]);
    };
}

template <int Len, int Lags>
Call autoCorr(const Api& z) {
    auto x = buffer(randomFloats(Len, 7, -1, 1));
    float* d = as<float>(out());
    return [&z, x, d] {
        z.zorsAutoCorr_32f(x->data(), Len, d, Lags);
        keep(d[1]);
    };
}

// Hamming windows of 1024 and 1023 samples in turn: every call builds its weights.
Call hammingAlternating(const Api& z) {
    auto n = std::make_shared<int>(1024);
    float* d = as<float>(out());
    return [&z, n, d] {
        z.zorsWinHamming_32f(signals().a.data(), d, *n);
        *n = 2047 - *n;
        keep(d[5]);
    };
}

// 1920 x 1080 -> 1280 x 720 turned by 10 degrees about the centre.
Call warpAffine(const Api& z) {
    const double a = std::cos(10.0 / 180 * 3.141592653589793) * 2 / 3, b = std::sin(10.0 / 180 * 3.141592653589793) * 2 / 3;
    const double m[2][3] = {{a, b, (1 - a) * 960 - b * 540 + 640 - 960}, {-b, a, b * 960 + (1 - a) * 540 + 360 - 540}};
    auto coeffs = std::make_shared<std::vector<double>>(&m[0][0], &m[0][0] + 6);
    uint8_t* d = out();
    std::memset(d, 0, size_t(1280) * 720 * 3);
    return [&z, coeffs, d] {
        const Picture s = noise<3>();
        z.zoriWarpAffine_8u_C3R(s.p, {kW, kH}, s.step, {0, 0, kW, kH}, d, 1280 * 3, {0, 0, 1280, 720},
                                reinterpret_cast<const double(*)[3]>(coeffs->data()), InterLinear);
        keep(d[7]);
    };
}

Call rotate(const Api& z) {
    double xs = 0, ys = 0;
    z.zoriGetRotateShift(960, 540, 30, &xs, &ys);
    uint8_t* d = out();
    std::memset(d, 0, size_t(kW) * kH);
    return [&z, xs, ys, d] {
        const Picture s = noise<1>();
        z.zoriRotate_8u_C1R(s.p, {kW, kH}, s.step, {0, 0, kW, kH}, d, kW, {0, 0, kW, kH}, 30, xs, ys, InterLinear);
        keep(d[7]);
    };
}

Call convFull(const Api& z) {
    auto a = buffer(randomFloats(512 * 512, 1, -1, 1)), k = buffer(randomFloats(81, 2, -1, 1));
    float* d = as<float>(out());
    return [&z, a, k, d] {
        z.zoriConvFull_32f_C1R(a->data(), 512 * 4, {512, 512}, k->data(), 9 * 4, {9, 9}, d, 520 * 4);
        keep(d[7]);
    };
}

template <int Bins>
Call histogram(const Api& z) {
    auto levels = buffer<int32_t>(Bins + 1), hist = buffer<int32_t>(Bins);
    for (int k = 0; k <= Bins; ++k) (*levels)[k] = k * 256 / Bins;
    return [&z, levels, hist] {
        z.zoriHistogramRange_8u_C1R(gray().p, gray().step, kRoi, hist->data(), levels->data(), Bins + 1);
        keep((*hist)[1]);
    };
}

// ---- filters of the test picture by mask size --------------------------------------

template <int M>
Prepare median() {
    return image(gray, 1, [](const Api& z, Picture s, uint8_t* d, int ds) {
        z.zoriFilterMedian_8u_C1R(s.p, s.step, d, ds, kRoi, {M, M}, {M / 2, M / 2});
    });
}
template <int M>
Prepare box() {
    return image(gray, 1, [](const Api& z, Picture s, uint8_t* d, int ds) {
        z.zoriFilterBox_8u_C1R(s.p, s.step, d, ds, kRoi, {M, M}, {M / 2, M / 2});
    });
}
template <int Mask>
Prepare sobelVert() {
    return image(gray, 2, [](const Api& z, Picture s, uint8_t* d, int ds) {
        z.zoriFilterSobelVert_8u16s_C1R(s.p, s.step, as<int16_t>(d), ds, kRoi, Mask);
    });
}
template <int Mask>
Prepare gauss() {
    return image(gray, 1, [](const Api& z, Picture s, uint8_t* d, int ds) {
        z.zoriFilterGauss_8u_C1R(s.p, s.step, d, ds, kRoi, Mask);
    });
}

// ---- the workloads of bench/bench_*.cpp, in file order ----------------------------

const int32_t kKernel[25] = {1, 1, 2, 1, 1, 1, 2, 3, 2, 1, 2, 3, 5, 3, 2, 1, 2, 3, 2, 1, 1, 1, 2, 1, 1};
const double kA[9] = {4, -2, 1, 3, 6, -4, 2, 1, 8}, kB3[3] = {12, -25, 32};

const std::vector<Workload>& workloads() {
    using Z = const Api&;
    using P = Picture;
    using D = uint8_t*;
    static const std::vector<Workload> w = {
        // arith
        {"zoriAdd_8u_C1RSfs sf 0 1920x1080", image(noise<1>, 1, [](Z z, P s, D d, int ds) {
             z.zoriAdd_8u_C1RSfs(s.p, s.step, noise<1, 1>().p, s.step, d, ds, kRoi, 0); })},
        {"zoriCompareC_8u_C1R > 1920x1080", image(noise<1>, 1, [](Z z, P s, D d, int ds) {
             z.zoriCompareC_8u_C1R(s.p, s.step, 128, d, ds, kRoi, CmpGreater); })},
        {"zoriAlphaComp_8u_AC4R Over 1920x1080", image(noise<4>, 4, [](Z z, P s, D d, int ds) {
             z.zoriAlphaComp_8u_AC4R(s.p, s.step, noise<4, 1>().p, s.step, d, ds, kRoi, AlphaOver); })},
        // color
        {"zoriRGBToYCbCr_8u_C3R 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             z.zoriRGBToYCbCr_8u_C3R(s.p, s.step, d, ds, kRoi); })},
        {"zoriYCbCrToRGB_8u_C3R 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             z.zoriYCbCrToRGB_8u_C3R(s.p, s.step, d, ds, kRoi); })},
        {"zoriRGBToGray_8u_C3C1R 1920x1080", image(noise<3>, 1, [](Z z, P s, D d, int ds) {
             z.zoriRGBToGray_8u_C3C1R(s.p, s.step, d, ds, kRoi); })},
        {"zoriRGBToHSV_8u_C3R 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             z.zoriRGBToHSV_8u_C3R(s.p, s.step, d, ds, kRoi); })},
        {"zoriBGRToYCbCr420_8u_C3P3R 1920x1080", image(noise<3>, 1, [](Z z, P s, D d, int ds) {
             uint8_t* const planes[3] = {d, d + kW * kH, d + kW * kH * 5 / 4};
             const int steps[3] = {ds, ds / 2, ds / 2};
             z.zoriBGRToYCbCr420_8u_C3P3R(s.p, s.step, planes, steps, kRoi); })},
        {"zoriDCTQuantFwd8x8LS_JPEG 8x8 blocks 1920x1080", jpegBlocks},
        // dft2d
        {"zoriDFTFwd_RToPack_32f_C1R 1024x1024", dft2d<1024, 1024, false>},
        {"zoriDFTFwd_RToPack_32f_C1R 1000x1000", dft2d<1000, 1000, false>},
        {"zoriDFTFwd_RToPack_32f_C1R 1009x241", dft2d<1009, 241, false>},
        {"zoriDFTInv_PackToR_32f_C1R 1000x1000", dft2d<1000, 1000, true>},
        // filter
        {"zoriFilter_8u_C1R 5x5 /45 1920x1080", image(gray, 1, [](Z z, P s, D d, int ds) {
             z.zoriFilter_8u_C1R(s.p, s.step, d, ds, kRoi, kKernel, {5, 5}, {2, 2}, 45); })},
        {"zoriFilter32f_8u_C1R 5x5 1920x1080", image(gray, 1, [](Z z, P s, D d, int ds) {
             float k[25];
             for (int i = 0; i < 25; ++i) k[i] = float(kKernel[i]) / 45.0f;
             z.zoriFilter32f_8u_C1R(s.p, s.step, d, ds, kRoi, k, {5, 5}, {2, 2}); })},
        {"zoriFilterSobelVert_8u16s_C1R 33 1920x1080", sobelVert<33>()},
        {"zoriFilterSobelVert_8u16s_C1R 55 1920x1080", sobelVert<55>()},
        {"zoriFilterMedian_8u_C1R 3x3 1920x1080", median<3>()},
        {"zoriFilterMedian_8u_C1R 5x5 1920x1080", median<5>()},
        {"zoriFilterMedian_8u_C1R 7x7 1920x1080", median<7>()},
        {"zoriFilterMax_8u_C1R 3x3 1920x1080", image(gray, 1, [](Z z, P s, D d, int ds) {
             z.zoriFilterMax_8u_C1R(s.p, s.step, d, ds, kRoi, {3, 3}, {1, 1}); })},
        {"zoriDilate3x3_8u_C1IR 1920x1080", dilateInPlace},
        {"zoriCanny_16s8u_C1R 100/200 1920x1080", canny},
        // floodqr
        {"zoriFloodFill_4Con_8u_C1IR large region 1920x1080", flood},
        {"zoriFloodFill_Grad4Con_8u_C1IR 1920x1080", floodGradient},
        {"zormQRDecomp_m_64f + BackSubst 3x3", plain([](Z z) {
             double qr[9], work[3], x[3];
             z.zormQRDecomp_m_64f(kA, 24, 8, work, qr, 24, 8, 3, 3);
             z.zormQRBackSubst_mv_64f(qr, 24, 8, work, kB3, 8, x, 8, 3, 3);
             keep(x[2]); })},
        // frame
        {"zorsMalloc_32f+zorsFree 64 KiB", plain([](Z z) {
             float* p = z.zorsMalloc_32f(16384);
             keep(p);
             z.zorsFree(p); })},
        // geometry
        {"zoriResize_8u_C3R linear 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 1280, 720, InterLinear)},
        {"zoriResize_8u_C3R cubic 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 1280, 720, InterCubic)},
        {"zoriResize_8u_C1R super 1920x1080>960x540", resize<uint8_t, &Api::zoriResize_8u_C1R>(gray, 960, 540, InterSuper)},
        {"zoriResize_32f_C1R linear 1920x1080>1280x720", resize<float, &Api::zoriResize_32f_C1R>(real, 1280, 720, InterLinear)},
        {"zoriResize_8u_C3R super 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 1280, 720, InterSuper)},
        {"zoriResize_8u_C3R Lanczos 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 1280, 720, InterLanczos)},
        {"zoriResize_8u_C3R super 1920x1080>160x90", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 160, 90, InterSuper)},
        {"zoriResize_8u_C3R nearest 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 1280, 720, InterNearest)},
        {"zoriResize_8u_C3R linear 1920x1080>2880x1620", resize<uint8_t, &Api::zoriResize_8u_C3R>(noise<3>, 2880, 1620, InterLinear)},
        {"zoriResize_8u_C1R linear 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C1R>(gray, 1280, 720, InterLinear)},
        {"zoriResize_8u_C4R linear 1920x1080>1280x720", resize<uint8_t, &Api::zoriResize_8u_C4R>(noise<4>, 1280, 720, InterLinear)},
        {"zoriResize_16u_C3R linear 1920x1080>1280x720", resize<uint16_t, &Api::zoriResize_16u_C3R>(rgb16, 1280, 720, InterLinear)},
        {"zoriResize_16u_C3R cubic 1920x1080>1280x720", resize<uint16_t, &Api::zoriResize_16u_C3R>(rgb16, 1280, 720, InterCubic)},
        {"zoriResize_32f_C1R cubic 1920x1080>1280x720", resize<float, &Api::zoriResize_32f_C1R>(real, 1280, 720, InterCubic)},
        {"zoriResize_32f_C1R super 1920x1080>640x360", resize<float, &Api::zoriResize_32f_C1R>(real, 640, 360, InterSuper)},
        // mirror
        {"zoriMirror_8u_C3R axis 1 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             z.zoriMirror_8u_C3R(s.p, s.step, d, ds, kRoi, 1); })},
        {"zoriMirror_8u_C1IR axis 2 1920x1080", mirrorInPlace},
        // pixel
        {"zoriCopy_8u_C3R 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             z.zoriCopy_8u_C3R(s.p, s.step, d, ds, kRoi); })},
        {"zoriCopy_8u_C3P3R 1920x1080", image(noise<3>, 1, [](Z z, P s, D d, int ds) {
             uint8_t* const planes[3] = {d, d + kW * kH, d + 2 * kW * kH};
             z.zoriCopy_8u_C3P3R(s.p, s.step, planes, ds, kRoi); })},
        {"zoriCopy_8u_P3C3R 1920x1080", image(noise<1>, 3, [](Z z, P s, D d, int ds) {
             const uint8_t* const planes[3] = {s.p, noise<1, 1>().p, noise<1, 2>().p};
             z.zoriCopy_8u_P3C3R(planes, s.step, d, ds, kRoi); })},
        {"zoriConvert_8u32f_C1R 1920x1080", image(noise<1>, 4, [](Z z, P s, D d, int ds) {
             z.zoriConvert_8u32f_C1R(s.p, s.step, as<float>(d), ds, kRoi); })},
        {"zoriConvert_32f8u_C1R mode 1 1920x1080", image(real, 1, [](Z z, P s, D d, int ds) {
             z.zoriConvert_32f8u_C1R(as<float>(s.p), s.step, d, ds, kRoi, 1); })},
        {"zoriSwapChannels_8u_C3R {2,1,0} 1920x1080", image(noise<3>, 3, [](Z z, P s, D d, int ds) {
             const int order[3] = {2, 1, 0};
             z.zoriSwapChannels_8u_C3R(s.p, s.step, d, ds, kRoi, order); })},
        {"zoriSet_8u_C3R 1920x1080", image(noise<3>, 3, [](Z z, P, D d, int ds) {
             const uint8_t v[3] = {10, 20, 30};
             z.zoriSet_8u_C3R(v, d, ds, kRoi); })},
        // smoothing
        {"zoriFilterBox_8u_C1R 5x5 1920x1080", box<5>()},
        {"zoriFilterGauss_8u_C1R 55 1920x1080", gauss<55>()},
        {"zoriFilterBox_8u_C1R 3x3 1920x1080", box<3>()},
        {"zoriFilterBox_8u_C1R 15x15 1920x1080", box<15>()},
        {"zoriFilterBox_8u_C3R 5x5 1920x1080", image(noiseWithBorder, 3, [](Z z, P s, D d, int ds) {
             z.zoriFilterBox_8u_C3R(s.p, s.step, d, ds, kRoi, {5, 5}, {2, 2}); })},
        {"zoriFilterGauss_8u_C1R 33 1920x1080", gauss<33>()},
        {"zoriFilterGauss_8u_C3R 55 1920x1080", image(noiseWithBorder, 3, [](Z z, P s, D d, int ds) {
             z.zoriFilterGauss_8u_C3R(s.p, s.step, d, ds, kRoi, 55); })},
        {"zoriConvFull_32f_C1R 512x512 * 9x9", convFull},
        // speech
        {"MFCC 25/10 ms, FFT 512, 26 mel, 13 ceps, 1 min 16 kHz", mfcc},
        // stats
        {"zoriSum_8u_C1R 1920x1080", plain([](Z z) {
             double sum = 0;
             z.zoriSum_8u_C1R(gray().p, gray().step, kRoi, &sum);
             keep(sum); })},
        {"zoriNormDiff_L1_8u_C1R 1920x1080", plain([](Z z) {
             double n = 0;
             z.zoriNormDiff_L1_8u_C1R(gray().p, gray().step, gray().p + 1, gray().step, kRoi, &n);
             keep(n); })},
        {"zoriSum_32f_C1R (fast) 1920x1080", plain([](Z z) {
             double sum = 0;
             z.zoriSum_32f_C1R(as<float>(real().p), real().step, kRoi, &sum, 0);
             keep(sum); })},
        {"zoriMinMaxIndx_16u_C3CR 1920x1080", plain([](Z z) {
             float lo, hi;
             ImagePoint pl, ph;
             z.zoriMinMaxIndx_16u_C3CR(as<uint16_t>(rgb16().p), rgb16().step, kRoi, 2, &lo, &hi, &pl, &ph);
             keep(lo); })},
        {"zoriMean_StdDev_16u_C3CR 1920x1080", plain([](Z z) {
             double mean, dev;
             z.zoriMean_StdDev_16u_C3CR(as<uint16_t>(rgb16().p), rgb16().step, kRoi, 2, &mean, &dev);
             keep(dev); })},
        {"zoriHistogramRange_8u_C1R 256 bins 1920x1080", histogram<256>},
        {"zoriHistogramRange_8u_C1R 4 bins 1920x1080", histogram<4>},
        {"zoriMoments64f_32f_C1R 1920x1080", moments},
        // transform
        {"zorsFFTFwd_CToC_32f N=1024", fftC<10>},
        {"zorsFFTFwd_CToC_32f N=4096", fftC<12>},
        {"zorsFFTFwd_RToCCS_32f N=512", fftR<9>},
        {"zorsFFTFwd_RToCCS_32f N=1024", fftR<10>},
        {"zorsFFTFwd_RToCCS_32f N=4096", fftR<12>},
        {"zorsIIR_32f order 4, 64 Ki samples", iir},
        {"zorsRandGauss_32f 64 Ki samples", randGauss},
        {"zorsAutoCorr_32f 400 samples, 13 lags", autoCorr<400, 13>},
        {"zorsAutoCorr_32f 4096 samples, 4096 lags", autoCorr<4096, 4096>},
        // vector arith
        {"zorsAdd_32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsAdd_32f(v.a.data(), v.b.data(), as<float>(d), kLen); })},
        {"zorsMulC_32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsMulC_32f(v.a.data(), 2.5f, as<float>(d), kLen); })},
        {"zorsMul_NR_16s_Sfs 64Ki sf=12", signal([](Z z, Signals& v, D d) {
             z.zorsMul_NR_16s_Sfs(v.s1.data(), v.s2.data(), as<int16_t>(d), kLen, 12); })},
        {"zorsDotProd_32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsDotProd_32f(v.a.data(), v.b.data(), kLen, as<float>(d)); })},
        {"zorsNorm_L2_16s32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsNorm_L2_16s32f(v.s1.data(), kLen, as<float>(d)); })},
        {"zorsMagnitude_32fc 64Ki", signal([](Z z, Signals& v, D d) {
             z.zorsMagnitude_32fc(reinterpret_cast<const Complex32f*>(v.wide.data()), as<float>(d), kLen); })},
        {"zorsPhase_32f 64Ki", signal([](Z z, Signals& v, D d) {
             z.zorsPhase_32f(v.wide.data(), v.wide.data() + kLen, as<float>(d), kLen); })},
        {"zorsLn_32f_I 64Ki (+copy)", signal([](Z z, Signals& v, D d) {
             std::memcpy(d, v.positive.data(), kLen * sizeof(float));
             z.zorsLn_32f_I(as<float>(d), kLen); })},
        {"zorsMaxIndx_32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsMaxIndx_32f(v.a.data(), kLen, as<float>(d), as<int>(d + 4)); })},
        {"zorsSortDescend_32f_I 64Ki (+copy)", signal([](Z z, Signals& v, D d) {
             std::memcpy(d, v.spread.data(), kLen * sizeof(float));
             z.zorsSortDescend_32f_I(as<float>(d), kLen); })},
        // vector init
        {"zorsConvert_32f16s_Sfs RoundNear sf 0, 64Ki", signal([](Z z, Signals& v, D d) {
             z.zorsConvert_32f16s_Sfs(v.ramp.data(), as<int16_t>(d), kLen, RoundNear, 0); })},
        {"zorsConvert_16s32f 64Ki", signal([](Z z, Signals& v, D d) { z.zorsConvert_16s32f(v.ramp16.data(), as<float>(d), kLen); })},
        {"zorsWinHamming_32f 1024", signal([](Z z, Signals& v, D d) { z.zorsWinHamming_32f(v.a.data(), as<float>(d), 1024); })},
        {"zorsWinHamming_32f 1024/1023 alternating", hammingAlternating},
        // warp
        {"zoriWarpAffine_8u_C3R linear 1920x1080 -> 1280x720, 10 deg", warpAffine},
        {"zoriRotate_8u_C1R 30 deg linear 1920x1080", rotate},
    };
    return w;
}

double nowNs() {
    using namespace std::chrono;
    return double(duration_cast<nanoseconds>(steady_clock::now().time_since_epoch()).count());
}

// Nanoseconds per call: the fastest of several batches of at least ~2 ms
// each.  On a shared machine a batch can only be slowed down (by being
// descheduled), so the fastest one is the closest to the code's own speed.
double timeCalls(const std::function<void()>& call, long& batch) {
    double best = 0;
    for (int tries = 0; tries < 15;) {
        const double t0 = nowNs();
        for (long i = 0; i < batch; ++i) call();
        const double t = nowNs() - t0;
        if (t < 2e6) {  // too short to time: grow the batch and start over
            batch = std::max(batch * 2, long(batch * (2.5e6 / std::max(t, 1.0))));
            tries = 0;
            best = 0;
            continue;
        }
        const double perCall = t / double(batch);
        best = tries++ == 0 ? perCall : std::min(best, perCall);
    }
    return best;
}

// Whether name contains one of the '|'-separated parts of filter (an empty
// filter takes every workload).
bool matches(const std::string& name, const std::string& filter) {
    if (filter.empty()) return true;
    std::stringstream parts(filter);
    std::string part;
    while (std::getline(parts, part, '|'))
        if (!part.empty() && name.find(part) != std::string::npos) return true;
    return false;
}

int runTimings(const std::vector<int>& variants, int reps, const std::string& filter) {
    struct Case {
        std::string name;
        int variant;
        std::function<void()> call;
        long batch = 1;
    };
    std::vector<Case> cases;
    Api apis[zor::dispatch::kColumns];
    for (int k = 0; k < zor::dispatch::kColumns; ++k) apis[k] = columnApi(k);
    for (const Workload& w : workloads()) {
        if (!matches(w.name, filter)) continue;
        for (int k : variants) {
            cases.push_back({w.name, k, w.prepare(apis[k])});
        }
    }
    // Repetitions in alternation, so that a slow spell of a shared machine
    // spreads over all cases instead of spoiling one.
    for (Case& c : cases) c.call();
    for (int r = 0; r < reps; ++r)
        for (Case& c : cases) {
            const double ns = timeCalls(c.call, c.batch);
            std::printf("%s\t%d\t%.1f\n", c.name.c_str(), c.variant, ns);
            std::fflush(stdout);
        }
    return 0;
}

using Medians = std::map<std::pair<std::string, int>, double>;

Medians readMedians(const char* path) {
    std::map<std::pair<std::string, int>, std::vector<double>> all;
    std::ifstream in(path);
    std::string line;
    while (std::getline(in, line)) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        const auto t1 = line.find('\t'), t2 = line.rfind('\t');
        if (t1 == std::string::npos || t1 == t2) continue;
        all[{line.substr(0, t1), std::atoi(line.c_str() + t1 + 1)}].push_back(std::atof(line.c_str() + t2 + 1));
    }
    Medians m;
    for (auto& kv : all) {
        std::vector<double>& v = kv.second;
        std::sort(v.begin(), v.end());
        m[kv.first] = v.size() % 2 ? v[v.size() / 2] : 0.5 * (v[v.size() / 2 - 1] + v[v.size() / 2]);
    }
    return m;
}

int printTable(const char* nativePath, const char* win32Path) {
    const Medians native = readMedians(nativePath), win = readMedians(win32Path);
    std::printf("%-60s %3s %12s %12s %8s %9s\n", "workload", "var", "x86-64 ns", "32-bit ns",
                "32/64", "vs var 4");
    for (const Workload& w : workloads())
        for (int k : {4, 3, 2, 1, 0}) {
            const auto key = std::make_pair(std::string(w.name), k);
            const auto it = win.find(key);
            if (it == win.end()) continue;
            const auto nat = native.find(key);
            char n64[32] = "-", ratio[32] = "-", rel4[32] = "-";
            if (nat != native.end()) {
                std::snprintf(n64, sizeof n64, "%.0f", nat->second);
                std::snprintf(ratio, sizeof ratio, "%.2f", it->second / nat->second);
            }
            const auto v4 = win.find(std::make_pair(std::string(w.name), 4));
            if (k != 4 && v4 != win.end()) std::snprintf(rel4, sizeof rel4, "%.2f", it->second / v4->second);
            std::printf("%-60s %3d %12s %12.0f %8s %9s%s\n", w.name, k, n64, it->second, ratio, rel4,
                        k == 4 && nat != native.end() && it->second / nat->second > 1.25 ? "  (above 1.25)" : "");
        }
    return 0;
}

}  // namespace

int main(int argc, char** argv) {
    std::vector<int> variants = {4};
    int reps = 5;
    std::string filter;
    for (int i = 1; i < argc; ++i) {
        const std::string a = argv[i];
        if (a == "--table" && i + 2 < argc) return printTable(argv[i + 1], argv[i + 2]);
        if (a == "--reps" && i + 1 < argc) reps = std::atoi(argv[++i]);
        else if (a == "--filter" && i + 1 < argc) filter = argv[++i];
        else if (a == "--variants" && i + 1 < argc) {
            variants.clear();
            std::stringstream s(argv[++i]);
            std::string item;
            while (std::getline(s, item, ','))
                if (!item.empty() && item[0] >= '0' && item[0] < '0' + zor::dispatch::kColumns)
                    variants.push_back(item[0] - '0');
        } else {
            std::fprintf(stderr, "usage: %s [--variants 4,1,0] [--reps n] [--filter text|text...] | --table a b\n", argv[0]);
            return 2;
        }
    }
    // Bind the slots and build the tables the library builds at load.
    if (!zor::frame::processAttach(nullptr)) return 1;
    return runTimings(variants, reps, filter);
}
