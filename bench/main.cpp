// Runs every workload for zor and its peer in one process and prints, per
// workload, both times and their ratio (zor / peer: below 1 zor is faster).
#include <benchmark/benchmark.h>
#include <opencv2/core.hpp>

#include <cstdio>
#include <map>
#include <string>
#include <vector>

#include "bench/pairs.h"

namespace zb {

namespace {
struct Pair {
    std::string peerName;
    double target = 0;
    double zorNs = -1, peerNs = -1;
};
std::map<std::string, Pair>& pairs() {
    static std::map<std::string, Pair> p;
    return p;
}
std::vector<std::string>& order() {
    static std::vector<std::string> o;
    return o;
}

class PairReporter : public benchmark::ConsoleReporter {
public:
    void ReportRuns(const std::vector<Run>& runs) override {
        ConsoleReporter::ReportRuns(runs);
        for (const Run& r : runs) {
            if (r.error_occurred) continue;
            // With repetitions, the median stands for the workload; without,
            // the single measurement does.
            const bool median = r.run_type == Run::RT_Aggregate && r.aggregate_name == "median";
            if (r.run_type != Run::RT_Iteration && !median) continue;
            const std::string name = r.run_name.str();
            const auto slash = name.rfind('/');
            if (slash == std::string::npos) continue;
            auto it = pairs().find(name.substr(0, slash));
            if (it == pairs().end()) continue;
            const double ns = r.GetAdjustedRealTime();  // default unit: ns
            (name.substr(slash + 1) == "zor" ? it->second.zorNs : it->second.peerNs) = ns;
        }
    }
    void Finalize() override {
        ConsoleReporter::Finalize();
        std::printf("\n%-44s %12s %12s %7s %7s  %s\n", "workload", "zor ns", "peer ns", "ratio",
                    "target", "peer");
        for (const std::string& w : order()) {
            const Pair& p = pairs()[w];
            if (p.zorNs < 0 || p.peerNs < 0) continue;
            const double ratio = p.zorNs / p.peerNs;
            char target[16] = "-";
            if (p.target > 0) std::snprintf(target, sizeof target, "%.2f", p.target);
            const bool missed = p.target > 0 && ratio > p.target;
            std::printf("%-44s %12.0f %12.0f %7.3f %7s  %s%s\n", w.c_str(), p.zorNs, p.peerNs,
                        ratio, target, p.peerName.c_str(), missed ? "  (above target)" : "");
        }
    }
};
}  // namespace

PairRegistrar::PairRegistrar(const std::string& workload, void (*zor)(benchmark::State&),
                             void (*peer)(benchmark::State&), const std::string& peerName,
                             double target) {
    pairs()[workload] = Pair{peerName, target};
    order().push_back(workload);
    benchmark::RegisterBenchmark((workload + "/zor").c_str(), zor);
    benchmark::RegisterBenchmark((workload + "/peer").c_str(), peer);
}

}  // namespace zb

int main(int argc, char** argv) {
    cv::setNumThreads(1);  // peers run single-threaded, like zor
    benchmark::Initialize(&argc, argv);
    zb::PairReporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    benchmark::Shutdown();
    return 0;
}
