// Comparisons printed after the benchmark tables as
//   ratio <name> <ours divided by the peer's, higher is better>
//
// PAVOQEN_RATIO(name, ours, peer) compares two benchmarks by time per
// iteration (both must do the same work per iteration): ratio = peer / ours.
// PAVOQEN_RATIO_COUNTER(name, ours, peer, counter) compares a rate counter
// (for example "items_per_second"): ratio = ours / peer.
// The peer may list alternatives separated by '|' ("BM_A|BM_B"); the best of
// them (shortest time, highest counter) is the one compared.
#pragma once

#include <string>
#include <vector>

struct bench_ratio {
    std::string name, ours, peer, counter;
};

std::vector<bench_ratio>& bench_ratios();

struct bench_ratio_registrar {
    bench_ratio_registrar(const char* name, const char* ours, const char* peer, const char* counter) {
        bench_ratios().push_back({name, ours, peer, counter});
    }
};

#define PAVOQEN_CAT2(a, b) a##b
#define PAVOQEN_CAT(a, b) PAVOQEN_CAT2(a, b)
#define PAVOQEN_RATIO(name, ours, peer) \
    static bench_ratio_registrar PAVOQEN_CAT(ratio_, __LINE__)(name, ours, peer, "")
#define PAVOQEN_RATIO_COUNTER(name, ours, peer, counter) \
    static bench_ratio_registrar PAVOQEN_CAT(ratio_, __LINE__)(name, ours, peer, counter)
