// Recording the argument sets the tests use (ZT_RECORD_CALLS=<file>): the
// generic variant's table then points at trampolines that append one line
// per distinct call, "name param=value ...", and go on to the real entry.
// The fuzzer's seed corpus is made from these lines (tests/fuzz).
#include "tests/support/record.h"

#include <cstdio>
#include <cstring>
#include <mutex>
#include <set>
#include <sstream>
#include <string>
#include <type_traits>
#include <vector>

#include "frame/dispatch.h"

namespace zt {

namespace {

constexpr int kPerExport = 48;  // distinct lines kept per export

struct Log {
    std::FILE* file = nullptr;
    std::mutex lock;
    std::set<std::string> seen;
    int count[zor::dispatch::kExportCount] = {};
};
Log& log() {
    static Log l;
    return l;
}

zor::dispatch::Entry gReal[zor::dispatch::kExportCount];
const char* gNames[zor::dispatch::kExportCount];
std::vector<std::string> gParams[zor::dispatch::kExportCount];

std::vector<std::string> paramNames(const char* text) {
    std::string s = text;
    std::vector<std::string> out;
    std::stringstream in(s.substr(1, s.size() - 2));
    std::string piece;
    while (std::getline(in, piece, ',')) {
        const size_t bracket = piece.find('[');
        if (bracket != std::string::npos) piece.erase(bracket);
        while (!piece.empty() && piece.back() == ' ') piece.pop_back();
        const size_t b = piece.find_last_of(" *");
        out.push_back(b == std::string::npos ? piece : piece.substr(b + 1));
    }
    return out;
}

template <class T>
std::string text(T v) {
    char b[96];
    if constexpr (std::is_pointer_v<T>) return v ? "p" : "0";
    else if constexpr (std::is_floating_point_v<T>) std::snprintf(b, sizeof b, "%.9g", double(v));
    else if constexpr (std::is_integral_v<T>) std::snprintf(b, sizeof b, "%lld", static_cast<long long>(v));
    else if constexpr (std::is_same_v<T, ImageSize>) std::snprintf(b, sizeof b, "%dx%d", v.width, v.height);
    else if constexpr (std::is_same_v<T, ImagePoint>) std::snprintf(b, sizeof b, "%dx%d", v.x, v.y);
    else if constexpr (std::is_same_v<T, ImageRect>)
        std::snprintf(b, sizeof b, "%d,%d,%d,%d", v.x, v.y, v.width, v.height);
    else std::snprintf(b, sizeof b, "%.9g,%.9g", double(v.re), double(v.im));
    return b;
}

void record(int index, const std::vector<std::string>& values) {
    Log& l = log();
    std::string line = gNames[index];
    for (size_t k = 0; k < values.size() && k < gParams[index].size(); ++k)
        line += " " + gParams[index][k] + "=" + values[k];
    std::lock_guard<std::mutex> hold(l.lock);
    if (!l.file || l.count[index] >= kPerExport || !l.seen.insert(line).second) return;
    ++l.count[index];
    std::fprintf(l.file, "%s\n", line.c_str());
}

template <int I, class F>
struct Trampoline;
template <int I, class R, class... A>
struct Trampoline<I, R(A...)> {
    static R ZOR_CALL call(A... a) {
        record(I, {text(a)...});
        return reinterpret_cast<R(ZOR_CALL*)(A...)>(gReal[I])(a...);
    }
};

}  // namespace

Api recordingApi(const Api& real, const char* path) {
    Log& l = log();
    l.file = std::fopen(path, "w");
    Api a = real;
#define ZOR_FN(map, ret, name, params)                                                   \
    gReal[zor::dispatch::Idx_##name] = reinterpret_cast<zor::dispatch::Entry>(real.name); \
    gNames[zor::dispatch::Idx_##name] = #name;                                            \
    gParams[zor::dispatch::Idx_##name] = paramNames(#params);                             \
    a.name = &Trampoline<zor::dispatch::Idx_##name, ret params>::call;
#include "zor_manifest.h"
#undef ZOR_FN
    std::atexit([] {
        if (log().file) std::fclose(log().file);
    });
    return a;
}

}  // namespace zt
