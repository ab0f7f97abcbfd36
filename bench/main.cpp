// Runs every registered benchmark, then prints the ratio lines.
#include <benchmark/benchmark.h>

#include <cstdio>
#include <map>

#include "ratio.h"

std::vector<bench_ratio>& bench_ratios() {
    static std::vector<bench_ratio> r;
    return r;
}

namespace {
struct recorded {
    double time = 0;  // real time per iteration, ns
    std::map<std::string, double> counters;
};

class recording_reporter : public benchmark::ConsoleReporter {
public:
    std::map<std::string, recorded> runs;
    void ReportRuns(const std::vector<Run>& reports) override {
        for (const Run& r : reports) {
            if (r.run_type != Run::RT_Iteration || r.error_occurred) continue;
            recorded& rec = runs[r.benchmark_name()];
            rec.time = r.GetAdjustedRealTime();
            for (auto& c : r.counters) rec.counters[c.first] = c.second.value;
        }
        ConsoleReporter::ReportRuns(reports);
    }
};
}  // namespace

int main(int argc, char** argv) {
    benchmark::Initialize(&argc, argv);
    recording_reporter reporter;
    benchmark::RunSpecifiedBenchmarks(&reporter);
    std::fflush(stdout);
    std::printf("\n");
    for (const bench_ratio& r : bench_ratios()) {
        auto a = reporter.runs.find(r.ours);
        if (a == reporter.runs.end()) continue;
        // The peer may name alternatives "A|B": the best of them counts.
        bool found = false;
        double peerTime = 0, peerCounter = 0;
        size_t from = 0;
        while (from <= r.peer.size()) {
            size_t bar = r.peer.find('|', from);
            if (bar == std::string::npos) bar = r.peer.size();
            auto b = reporter.runs.find(r.peer.substr(from, bar - from));
            from = bar + 1;
            if (b == reporter.runs.end()) continue;
            double t = b->second.time, c = r.counter.empty() ? 0 : b->second.counters[r.counter];
            if (!found || t < peerTime) peerTime = t;
            if (!found || c > peerCounter) peerCounter = c;
            found = true;
        }
        if (!found) continue;
        double value;
        if (r.counter.empty()) {
            value = a->second.time > 0 ? peerTime / a->second.time : 0;
        } else {
            double x = a->second.counters[r.counter];
            value = peerCounter > 0 ? x / peerCounter : 0;
        }
        std::printf("ratio %s %.2f\n", r.name.c_str(), value);
    }
    benchmark::Shutdown();
    return 0;
}
