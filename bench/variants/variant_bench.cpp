// Times a selection of the benchmark's workloads on zor alone, through the
// entries of chosen code variants, without a peer and without the benchmark
// framework: the same program builds for x86-64 and for 32-bit Windows, so
// the two builds of the library can be compared workload by workload.
//
//   zor_variant_bench [--variants 4,1,0] [--reps 5] [--filter text]
//       (on x86-64 columns 5 and 6 are the AVX2 and AVX-512 ones)
//       prints one line per measurement: "workload<TAB>variant<TAB>ns".
//   zor_variant_bench --table <x86-64 lines> <32-bit lines>
//       pairs the medians of two such outputs into a table with the ratio
//       32-bit / x86-64 (and, for the variants other than 4, the ratio to
//       variant 4 of the same build).
//
// The workloads repeat the zor side of bench/bench_*.cpp (same exports,
// sizes and arguments).
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
#include "frame/dispatch.h"
#include "zor.h"

namespace {

// The whole library as one variant's entries, typed like the exports.
struct Api {
#define ZOR_FN(map, ret, name, params) ret(ZOR_CALL* name) params;
#include "zor_manifest.h"
#undef ZOR_FN
};

Api variantApi(int k) {
    const zor::dispatch::Table t = zor::dispatch::libraryTable();
    Api a{};
#define ZOR_FN(map, ret, name, params) \
    a.name = reinterpret_cast<decltype(a.name)>(t.rows[zor::dispatch::Idx_##name].entry[k]);
#include "zor_manifest.h"
#undef ZOR_FN
    return a;
}

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
    explicit Buffer(size_t n, T fill = T()) : raw_(n * sizeof(T) + 64) {
        p_ = reinterpret_cast<T*>((reinterpret_cast<uintptr_t>(raw_.data()) + 63) & ~uintptr_t(63));
        std::fill(p_, p_ + n, fill);
    }
    explicit Buffer(const std::vector<T>& v) : Buffer(v.size()) { std::copy(v.begin(), v.end(), p_); }
    T* data() { return p_; }
    const T* data() const { return p_; }
    T& operator[](size_t i) { return p_[i]; }

private:
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

// The benchmarks' test picture (bench/picture.h) with a replicated border.
constexpr int kW = 1920, kH = 1080, kB = 3;
constexpr ImageSize kRoi{kW, kH};
struct Scene {
    int step = kW + 2 * kB;
    Buffer<uint8_t> padded = Buffer<uint8_t>(size_t(step) * (kH + 2 * kB));
    Scene() {
        std::vector<uint8_t> plain(size_t(kW) * kH);
        zb::fillTestPicture(plain.data(), kW, kH, kW);
        for (int y = -kB; y < kH + kB; ++y)
            for (int x = -kB; x < kW + kB; ++x)
                padded[size_t(y + kB) * step + (x + kB)] =
                    plain[size_t(std::min(kH - 1, std::max(0, y))) * kW + std::min(kW - 1, std::max(0, x))];
    }
    const uint8_t* roi() const { return padded.data() + size_t(kB) * step + kB; }
};
const Scene& scene() {
    static const Scene s;
    return s;
}

// A workload: prepares its data for one variant and returns the timed call.
struct Workload {
    const char* name;
    std::function<std::function<void()>(const Api&)> prepare;
    bool (*available)(const Api&);
};

constexpr int kLen = 64 * 1024;
const int32_t kKernel[25] = {1, 1, 2, 1, 1, 1, 2, 3, 2, 1, 2, 3, 5, 3, 2,
                             1, 2, 3, 2, 1, 1, 1, 2, 1, 1};

template <int Order>
std::function<void()> fftC(const Api& z) {
    const int n = 1 << Order;
    auto spec = std::make_shared<void*>(nullptr);
    z.zorsFFTInitAlloc_C_32f(spec.get(), Order, 8, 0);
    auto re = buffer(randomFloats(n, 1, -1, 1));
    auto im = buffer(randomFloats(n, 2, -1, 1));
    auto out = buffer<float>(2 * n);
    auto freeSpec = z.zorsFFTFree_C_32f;
    std::shared_ptr<void> owner(nullptr, [spec, freeSpec](void*) { freeSpec(*spec); });
    auto fwd = z.zorsFFTFwd_CToC_32f;
    return [=] {
        (void)owner;
        fwd(re->data(), im->data(), out->data(), out->data() + n, *spec, nullptr);
        keep((*out)[1]);
    };
}

template <int Order>
std::function<void()> fftR(const Api& z) {
    const int n = 1 << Order;
    auto spec = std::make_shared<void*>(nullptr);
    z.zorsFFTInitAlloc_R_32f(spec.get(), Order, 8, 0);
    auto x = buffer(randomFloats(n, 3, -1, 1));
    auto out = buffer<float>(n + 2);
    auto freeSpec = z.zorsFFTFree_R_32f;
    std::shared_ptr<void> owner(nullptr, [spec, freeSpec](void*) { freeSpec(*spec); });
    auto fwd = z.zorsFFTFwd_RToCCS_32f;
    return [=] {
        (void)owner;
        fwd(x->data(), out->data(), *spec, nullptr);
        keep((*out)[1]);
    };
}

std::function<void()> imageToImage(const Api&, std::function<void(const uint8_t*, int, uint8_t*, int)> f,
                                   int dstBytes) {
    auto dst = buffer<uint8_t>(size_t(kW) * kH * dstBytes);
    return [=] {
        f(scene().roi(), scene().step, dst->data(), kW * dstBytes);
        keep((*dst)[7]);
    };
}

const std::vector<Workload>& workloads() {
    static const std::vector<Workload> w = {
        {"zoriCopy_8u_C3R 1920x1080",
         [](const Api& z) -> std::function<void()> {
             auto a = buffer<uint8_t>(size_t(kW) * kH * 3, 7);
             auto b = buffer<uint8_t>(size_t(kW) * kH * 3);
             auto f = z.zoriCopy_8u_C3R;
             return [=] { keep(f(a->data(), kW * 3, b->data(), kW * 3, kRoi)); };
         },
         [](const Api& z) { return z.zoriCopy_8u_C3R != nullptr; }},
        {"zorsAdd_32f 64Ki",
         [](const Api& z) -> std::function<void()> {
             auto a = buffer(randomFloats(kLen, 1, -1, 1));
             auto b = buffer(randomFloats(kLen, 2, -1, 1));
             auto d = buffer<float>(kLen);
             auto f = z.zorsAdd_32f;
             return [=] { f(a->data(), b->data(), d->data(), kLen); keep((*d)[5]); };
         },
         [](const Api& z) { return z.zorsAdd_32f != nullptr; }},
        {"zorsDotProd_32f 64Ki",
         [](const Api& z) -> std::function<void()> {
             auto a = buffer(randomFloats(kLen, 1, -1, 1));
             auto b = buffer(randomFloats(kLen, 2, -1, 1));
             auto f = z.zorsDotProd_32f;
             return [=] { float r; f(a->data(), b->data(), kLen, &r); keep(r); };
         },
         [](const Api& z) { return z.zorsDotProd_32f != nullptr; }},
        {"zorsMagnitude_32fc 64Ki",
         [](const Api& z) -> std::function<void()> {
             auto c = buffer(randomFloats(2 * kLen, 1, -100, 100));
             auto d = buffer<float>(kLen);
             auto f = z.zorsMagnitude_32fc;
             return [=] {
                 f(reinterpret_cast<const Complex32f*>(c->data()), d->data(), kLen);
                 keep((*d)[5]);
             };
         },
         [](const Api& z) { return z.zorsMagnitude_32fc != nullptr; }},
        {"zorsLn_32f_I 64Ki (+copy)",
         [](const Api& z) -> std::function<void()> {
             auto s = buffer(randomFloats(kLen, 1, 1e-3f, 1e3f));
             auto w = buffer<float>(kLen);
             auto f = z.zorsLn_32f_I;
             return [=] {
                 std::memcpy(w->data(), s->data(), kLen * sizeof(float));
                 f(w->data(), kLen);
                 keep((*w)[5]);
             };
         },
         [](const Api& z) { return z.zorsLn_32f_I != nullptr; }},
        {"zoriFilter_8u_C1R 5x5 /45 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilter_8u_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, d, ds, kRoi, kKernel, {5, 5}, {2, 2}, 45);
             }, 1);
         },
         [](const Api& z) { return z.zoriFilter_8u_C1R != nullptr; }},
        {"zoriFilterMax_8u_C1R 3x3 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilterMax_8u_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, d, ds, kRoi, {3, 3}, {1, 1});
             }, 1);
         },
         [](const Api& z) { return z.zoriFilterMax_8u_C1R != nullptr; }},
        {"zoriFilterMedian_8u_C1R 3x3 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilterMedian_8u_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, d, ds, kRoi, {3, 3}, {1, 1});
             }, 1);
         },
         [](const Api& z) { return z.zoriFilterMedian_8u_C1R != nullptr; }},
        {"zoriFilterMedian_8u_C1R 5x5 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilterMedian_8u_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, d, ds, kRoi, {5, 5}, {2, 2});
             }, 1);
         },
         [](const Api& z) { return z.zoriFilterMedian_8u_C1R != nullptr; }},
        {"zoriFilterSobelVert_8u16s_C1R 33 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilterSobelVert_8u16s_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, reinterpret_cast<int16_t*>(d), ds, kRoi, 33);
             }, 2);
         },
         [](const Api& z) { return z.zoriFilterSobelVert_8u16s_C1R != nullptr; }},
        {"zoriFilterSobelVert_8u16s_C1R 55 1920x1080",
         [](const Api& z) {
             auto f = z.zoriFilterSobelVert_8u16s_C1R;
             return imageToImage(z, [f](const uint8_t* s, int ss, uint8_t* d, int ds) {
                 f(s, ss, reinterpret_cast<int16_t*>(d), ds, kRoi, 55);
             }, 2);
         },
         [](const Api& z) { return z.zoriFilterSobelVert_8u16s_C1R != nullptr; }},
        {"zorsFFTFwd_CToC_32f N=1024", fftC<10>,
         [](const Api& z) { return z.zorsFFTFwd_CToC_32f != nullptr; }},
        {"zorsFFTFwd_CToC_32f N=4096", fftC<12>,
         [](const Api& z) { return z.zorsFFTFwd_CToC_32f != nullptr; }},
        {"zorsFFTFwd_RToCCS_32f N=512", fftR<9>,
         [](const Api& z) { return z.zorsFFTFwd_RToCCS_32f != nullptr; }},
        {"zorsFFTFwd_RToCCS_32f N=1024", fftR<10>,
         [](const Api& z) { return z.zorsFFTFwd_RToCCS_32f != nullptr; }},
        {"zorsFFTFwd_RToCCS_32f N=4096", fftR<12>,
         [](const Api& z) { return z.zorsFFTFwd_RToCCS_32f != nullptr; }},
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

int runTimings(const std::vector<int>& variants, int reps, const std::string& filter) {
    struct Case {
        std::string name;
        int variant;
        std::function<void()> call;
        long batch = 1;
    };
    std::vector<Case> cases;
    Api apis[zor::dispatch::kColumns];
    for (int k = 0; k < zor::dispatch::kColumns; ++k) apis[k] = variantApi(k);
    for (const Workload& w : workloads()) {
        if (!filter.empty() && std::string(w.name).find(filter) == std::string::npos) continue;
        for (int k : variants) {
            if (!w.available(apis[k])) continue;
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
    std::printf("%-44s %3s %12s %12s %8s %9s\n", "workload", "var", "x86-64 ns", "32-bit ns",
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
            std::printf("%-44s %3d %12s %12.0f %8s %9s%s\n", w.name, k, n64, it->second, ratio, rel4,
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
            std::fprintf(stderr, "usage: %s [--variants 4,1,0] [--reps n] [--filter text] | --table a b\n", argv[0]);
            return 2;
        }
    }
    // Bind the slots and build the tables the library builds at load.
    if (!zor::frame::processAttach(nullptr)) return 1;
    return runTimings(variants, reps, filter);
}
