// zor bench: runs the benchmark program (bench/zor_bench: every workload
// timed for zor and for its peer in one process) and prints its pair table
// as text, CSV or Markdown, with a progress line while it runs.
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <map>
#include <set>
#include <sys/stat.h>

#include "tools/zor/tool.h"

#ifndef ZOR_BENCH_BINARY
#define ZOR_BENCH_BINARY "bench/zor_bench"
#endif

namespace ztool {
namespace {

struct ExportRow {
    const char* name;
    const char* home;
    const char* line;
};
const ExportRow kExports[] = {
#define ZOR_EXPORT(name, home, line) {name, home, line},
#include "zor_exports.inc"
#undef ZOR_EXPORT
};

struct Row {
    std::string workload, peer, target;
    double zorNs = 0, peerNs = 0, ratio = 0;
    bool above = false;
};

// Runs the shell command and hands each line of its output to `line`.
int run(const std::string& cmd, const std::function<void(const std::string&)>& line) {
    FILE* p = popen(cmd.c_str(), "r");
    if (!p) throw UserError("cannot run " + cmd);
    char buf[4096];
    std::string pending;
    while (std::fgets(buf, sizeof buf, p)) {
        pending += buf;
        if (!pending.empty() && pending.back() == '\n') {
            pending.pop_back();
            line(pending);
            pending.clear();
        }
    }
    if (!pending.empty()) line(pending);
    const int rc = pclose(p);
    return WIFEXITED(rc) ? WEXITSTATUS(rc) : 1;
}

std::string escapeRegex(const std::string& s) {
    std::string o;
    for (char c : s) {
        if (std::strchr("\\^$.|?*+()[]{}", c)) o += '\\';
        o += c;
    }
    return o;
}

std::string lower(std::string s) {
    for (char& c : s) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    return s;
}

// The family (home) of a workload: that of the export its name starts with.
std::string homeOf(const std::string& workload) {
    const std::string first = workload.substr(0, workload.find(' '));
    for (const ExportRow& e : kExports)
        if (first == e.name) return e.home;
    return "";
}

std::string cell(const std::string& s, size_t w) { return s + std::string(w > s.size() ? w - s.size() : 0, ' '); }

}  // namespace

int cmdBench(const Args& args) {
    const Options o = parseOptions(args, {"csv", "markdown", "list"});
    if (o.help) {
        std::puts(
            "usage: zor bench [FAMILY | TEXT] [--csv | --markdown] [--repetitions N] [--list]\n"
            "                 [--binary PATH]\n\n"
            "Times each workload for zor and for its peer (OpenCV, FFTW or a plain loop)\n"
            "in one process, alternating, and prints zor's and the peer's median time and\n"
            "their ratio (below 1: zor is faster) against the workload's target.\n"
            "FAMILY names a family (sobel, image/filter/sobel ...): the workloads of its\n"
            "exports; other TEXT selects the workloads whose name contains it.  --list\n"
            "prints the workloads and their families without running them.");
        return 0;
    }
    const std::string binary = o.get("binary", std::getenv("ZOR_BENCH") ? std::getenv("ZOR_BENCH") : ZOR_BENCH_BINARY);
    struct stat st;
    if (stat(binary.c_str(), &st) != 0)
        throw UserError(binary +
                        ": no benchmark program there (it is built with the native tree when Google "
                        "Benchmark, OpenCV and FFTW are installed: make native), or give --binary PATH");
    const int reps = static_cast<int>(o.number("repetitions", 3));
    if (reps < 1 || reps > 100) throw UserError("--repetitions must be from 1 to 100");

    std::vector<std::string> workloads;
    const int listed = run("'" + binary + "' --benchmark_list_tests=true 2>&1", [&](const std::string& l) {
        const size_t slash = l.rfind('/');
        if (slash != std::string::npos && l.substr(slash) == "/zor") workloads.push_back(l.substr(0, slash));
    });
    if (listed != 0 || workloads.empty()) throw UserError(binary + ": could not list the workloads");

    std::vector<std::string> chosen = workloads;
    if (!o.positional.empty()) {
        const std::string want = lower(o.positional[0]);
        chosen.clear();
        for (const std::string& w : workloads) {
            const std::string home = homeOf(w);
            const std::string family = home.substr(home.rfind('/') + 1);
            if (want == home || want == family || lower(w).find(want) != std::string::npos) chosen.push_back(w);
        }
        if (chosen.empty()) {
            std::set<std::string> families;
            for (const std::string& w : workloads) {
                const std::string h = homeOf(w);
                if (!h.empty()) families.insert(h.substr(h.rfind('/') + 1));
            }
            std::string list;
            for (const std::string& f : families) list += " " + f;
            throw UserError("no workload matches '" + o.positional[0] + "'; families with workloads:" + list);
        }
    }
    if (o.has("list")) {
        for (const std::string& w : chosen) std::printf("%-56s %s\n", w.c_str(), homeOf(w).c_str());
        return 0;
    }

    std::string filter;
    for (const std::string& w : chosen) filter += (filter.empty() ? "" : "|") + escapeRegex(w);
    const std::string cmd = "'" + binary + "' '--benchmark_filter=^(" + filter + ")/(zor|peer)$'" +
                            " --benchmark_repetitions=" + std::to_string(reps) +
                            " --benchmark_enable_random_interleaving=true 2>&1";
    const size_t total = chosen.size() * 2 * static_cast<size_t>(reps);
    size_t done = 0;
    const bool tty = isatty(2);
    bool inTable = false;
    std::vector<Row> rows;
    std::vector<std::string> errors;
    const int rc = run(cmd, [&](const std::string& l) {
        if (inTable) {
            for (const std::string& w : chosen) {
                if (l.compare(0, w.size(), w) != 0 || l.size() <= w.size() || l[w.size()] != ' ') continue;
                Row r;
                r.workload = w;
                char target[32] = "", peer[512] = "";
                int used = 0;
                if (std::sscanf(l.c_str() + w.size(), "%lf %lf %lf %31s %n", &r.zorNs, &r.peerNs, &r.ratio, target,
                                &used) < 4)
                    continue;
                std::snprintf(peer, sizeof peer, "%s", l.c_str() + w.size() + used);
                r.target = target;
                r.peer = peer;
                const size_t mark = r.peer.find("  (above target)");
                if (mark != std::string::npos) {
                    r.above = true;
                    r.peer.resize(mark);
                }
                rows.push_back(r);
            }
            return;
        }
        if (l.compare(0, 8, "workload") == 0 && l.find("zor ns") != std::string::npos) {
            inTable = true;
            if (tty) std::fprintf(stderr, "\r%-100s\r", "");
            return;
        }
        if (l.find("ERROR OCCURRED") != std::string::npos) errors.push_back(l);
        const size_t space = l.find(' ');
        const std::string name = l.substr(0, space);
        const size_t slash = name.rfind('/');
        if (slash == std::string::npos) return;
        const std::string kind = name.substr(slash + 1);
        if (kind != "zor" && kind != "peer") return;
        ++done;
        if (tty) std::fprintf(stderr, "\r[%zu/%zu] %-80.80s", std::min(done, total), total, name.c_str());
    });
    if (rc != 0) throw UserError(binary + " failed (exit status " + std::to_string(rc) + ")");
    for (const std::string& e : errors) std::fprintf(stderr, "%s\n", e.c_str());
    if (rows.empty()) throw UserError(binary + ": no result table in its output");

    char num[3][32];
    auto numbers = [&](const Row& r) {
        std::snprintf(num[0], sizeof num[0], "%.0f", r.zorNs);
        std::snprintf(num[1], sizeof num[1], "%.0f", r.peerNs);
        std::snprintf(num[2], sizeof num[2], "%.3f", r.ratio);
    };
    if (o.has("csv")) {
        std::puts("workload,family,zor_ns,peer_ns,ratio,target,peer,above_target");
        for (const Row& r : rows) {
            numbers(r);
            std::printf("\"%s\",%s,%s,%s,%s,%s,\"%s\",%s\n", r.workload.c_str(), homeOf(r.workload).c_str(), num[0],
                        num[1], num[2], r.target == "-" ? "" : r.target.c_str(), r.peer.c_str(),
                        r.above ? "yes" : "no");
        }
    } else if (o.has("markdown")) {
        std::puts("| workload | zor ns | peer ns | ratio | target | peer |\n|---|---:|---:|---:|---:|---|");
        for (const Row& r : rows) {
            numbers(r);
            std::printf("| %s | %s | %s | %s%s | %s | %s |\n", r.workload.c_str(), num[0], num[1], num[2],
                        r.above ? " (above)" : "", r.target.c_str(), r.peer.c_str());
        }
    } else {
        size_t w = 8;
        for (const Row& r : rows) w = std::max(w, r.workload.size());
        std::printf("%s %12s %12s %7s %7s  %s\n", cell("workload", w).c_str(), "zor ns", "peer ns", "ratio", "target",
                    "peer");
        for (const Row& r : rows) {
            numbers(r);
            std::printf("%s %12s %12s %7s %7s  %s%s\n", cell(r.workload, w).c_str(), num[0], num[1], num[2],
                        r.target.c_str(), r.peer.c_str(), r.above ? "  (above target)" : "");
        }
        std::printf("\nmedians of %d repetitions, zor and peer alternating; ratio = zor / peer\n", reps);
    }
    return 0;
}

}  // namespace ztool
