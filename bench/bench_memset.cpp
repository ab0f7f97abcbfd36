// Memory bandwidth reference: memset of a 1024 x 768 ARGB buffer.
#include <benchmark/benchmark.h>

#include <cstdlib>
#include <cstring>

static void BM_MemsetScreen(benchmark::State& state) {
    const size_t bytes = 1024 * 768 * 4;
    void* p = std::aligned_alloc(64, bytes);
    for (auto _ : state) {
        std::memset(p, 0x5A, bytes);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(bytes));
    std::free(p);
}
BENCHMARK(BM_MemsetScreen);
