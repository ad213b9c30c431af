// zor: the library's primitives from the command line.
//
//   zor info                      library, version records, processor, variant
//   zor demo [--out DIR]          the gallery: every family on bundled inputs
//   zor resize|filter|edges|color|mfcc ...   one operation on your own files
//   zor identify FILE...          what an image file holds
//   zor bench [FAMILY] [--csv|--markdown]    the benchmark report
#include <cpuid.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "tools/zor/tool.h"

extern "C" int zorToolProcessorType(void);

namespace ztool {
namespace {

struct StatusRow {
    int code;
    const char* name;
};
// Generated from zor.h's enum, so that no code is ever printed as a number.
const StatusRow kStatuses[] = {
#include "status_names.inc"
};

const char* const kUsage =
    "usage: zor <command> [arguments]\n"
    "\n"
    "  info                     library and version records, processor, bound variant\n"
    "  demo [--out DIR]         run every family on the bundled photograph and speech\n"
    "                           and write a gallery of PNGs and DIR/index.html\n"
    "  resize IN OUT ...        resize an image          (zor resize --help)\n"
    "  filter IN OUT ...        median, sharpen, blur, morphology (zor filter --help)\n"
    "  edges IN OUT ...         Sobel magnitude or Canny edges (zor edges --help)\n"
    "  color IN OUT ...         grey and colour-space planes (zor color --help)\n"
    "  mfcc IN.wav OUT ...      spectrogram, mel energies, MFCCs (zor mfcc --help)\n"
    "  identify FILE...         size, channels and value range of images\n"
    "  bench [FAMILY] [--csv | --markdown]\n"
    "                           time zor against its peers (zor bench --help)\n"
    "\n"
    "Images: PNG, binary PPM (P6) and PGM (P5), 8 bits per sample.  Audio: WAV,\n"
    "16-bit PCM.\n";

void printVersion(const char* what, const LibraryVersion* v) {
    std::printf("%-7s %d.%d.%d.%d  tag %-2s  %s  \"%s\"  built %s\n", what, v->major, v->minor, v->buildSeries,
                v->build, v->cpuTag, v->libraryName, v->versionText, v->buildDate);
}

}  // namespace

std::string statusName(Status s) {
    for (const StatusRow& r : kStatuses)
        if (r.code == s) return r.name;
    return "status " + std::to_string(s);
}

void check(Status s, const char* call) {
    if (s >= 0) return;
    std::string what(call);
    const size_t paren = what.find('(');
    if (paren != std::string::npos) what.resize(paren);
    throw UserError(what + " failed: " + statusName(s) + " (" + std::to_string(s) + ")");
}

std::string Options::get(const std::string& name, const std::string& fallback) const {
    for (const auto& kv : named)
        if (kv.first == name) return kv.second;
    return fallback;
}
bool Options::has(const std::string& name) const {
    return std::any_of(named.begin(), named.end(), [&](const auto& kv) { return kv.first == name; });
}
double Options::number(const std::string& name, double fallback) const {
    if (!has(name)) return fallback;
    const std::string v = get(name, "");
    char* end = nullptr;
    const double d = std::strtod(v.c_str(), &end);
    if (v.empty() || *end) throw UserError("--" + name + ": '" + v + "' is not a number");
    return d;
}

Options parseOptions(const Args& args, const std::vector<std::string>& flags) {
    Options o;
    for (size_t i = 0; i < args.size(); ++i) {
        const std::string& a = args[i];
        if (a == "-h" || a == "--help") {
            o.help = true;
        } else if (a.size() > 2 && a.compare(0, 2, "--") == 0) {
            std::string name = a.substr(2), value;
            const size_t eq = name.find('=');
            if (eq != std::string::npos) {
                value = name.substr(eq + 1);
                name.resize(eq);
            } else if (std::find(flags.begin(), flags.end(), name) == flags.end()) {
                if (i + 1 >= args.size()) throw UserError("--" + name + " needs a value");
                value = args[++i];
            }
            o.named.emplace_back(name, value);
        } else {
            o.positional.push_back(a);
        }
    }
    return o;
}

int cmdInfo(const Args& args) {
    if (parseOptions(args).help) {
        std::puts(
            "usage: zor info\n\nPrints the version records of the code variant bound at load, the\n"
            "processor-type code the library classified the processor as, and the\n"
            "processor's instruction-set features.");
        return 0;
    }
    static const char* const variants[5] = {"generic x86", "SSE", "SSE2", "SSE3", "SSSE3"};
    const LibraryVersion* s = zorsGetLibVersion();
    const LibraryVersion* i = zoriGetLibVersion();
    printVersion("signal", s);
    printVersion("image", i);
    const int variant = s->cpuTag[1] >= '0' && s->cpuTag[1] <= '4' ? s->cpuTag[1] - '0' : -1;
    std::printf("variant %d (%s), bound at load\n", variant, variant >= 0 ? variants[variant] : "?");
    std::printf("processor-type code %d\n", zorToolProcessorType());
    unsigned a = 0, b = 0, c = 0, d = 0;
    std::string features;
    if (__get_cpuid(1, &a, &b, &c, &d)) {
        const struct {
            unsigned word;
            int bit;
            const char* name;
        } bits[] = {{d, 23, "mmx"},    {d, 25, "sse"},    {d, 26, "sse2"}, {c, 0, "sse3"}, {c, 9, "ssse3"},
                    {c, 19, "sse4.1"}, {c, 20, "sse4.2"}, {c, 28, "avx"},  {c, 12, "fma"}};
        for (const auto& f : bits)
            if (f.word >> f.bit & 1) features += std::string(" ") + f.name;
        if (__get_cpuid_count(7, 0, &a, &b, &c, &d)) {
            if (b >> 5 & 1) features += " avx2";
            if (b >> 16 & 1) features += " avx512f";
        }
    }
    std::printf("processor features:%s\n", features.empty() ? " none reported" : features.c_str());
    return 0;
}

int cmdIdentify(const Args& args) {
    const Options o = parseOptions(args);
    if (o.help || o.positional.empty()) {
        std::puts(
            "usage: zor identify FILE...\n\nFor each image: format, size, channels, the smallest, largest and mean\n"
            "sample, and the share of samples that are not zero.");
        return o.help ? 0 : 2;
    }
    for (const std::string& path : o.positional) {
        const Image img = readImage(path);
        uint8_t lo = 255, hi = 0;
        double sum = 0;
        size_t nonzero = 0;
        for (uint8_t v : img.px) {
            lo = std::min(lo, v);
            hi = std::max(hi, v);
            sum += v;
            nonzero += v != 0;
        }
        const double n = static_cast<double>(img.px.size());
        std::printf("%s: %dx%d, %d channel%s, min %d, max %d, mean %.2f, nonzero %.4f\n", path.c_str(), img.width,
                    img.height, img.channels, img.channels == 1 ? "" : "s", lo, hi, sum / n, nonzero / n);
    }
    return 0;
}

}  // namespace ztool

int main(int argc, char** argv) {
    using namespace ztool;
    if (argc < 2) {
        std::fputs(kUsage, stderr);
        return 2;
    }
    const std::string cmd = argv[1];
    const Args args(argv + 2, argv + argc);
    static const struct {
        const char* name;
        int (*run)(const Args&);
    } commands[] = {{"info", cmdInfo},         {"demo", cmdDemo},     {"bench", cmdBench},
                    {"identify", cmdIdentify}, {"resize", cmdResize}, {"filter", cmdFilter},
                    {"edges", cmdEdges},       {"color", cmdColor},   {"mfcc", cmdMfcc}};
    if (cmd == "-h" || cmd == "--help" || cmd == "help") {
        std::fputs(kUsage, stdout);
        return 0;
    }
    for (const auto& c : commands) {
        if (cmd != c.name) continue;
        try {
            return c.run(args);
        } catch (const UserError& e) {
            std::fprintf(stderr, "zor %s: %s\n", c.name, e.what());
            return 1;
        } catch (const std::exception& e) {
            std::fprintf(stderr, "zor %s: %s\n", c.name, e.what());
            return 1;
        }
    }
    std::fprintf(stderr, "zor: unknown command '%s'\n\n%s", cmd.c_str(), kUsage);
    return 2;
}
