// Memory pools and texture uploads.
//
// Compaction: a pool of 8192 blocks (16 to 2048 bytes) with every other block
// freed ("half") or every sixteenth ("sparse"), compacted once per iteration;
// the peer is one plain memmove of the same number of bytes.
// Texture uploads: the cache's upload (LRU bookkeeping and the separable blur)
// per second; the blur alone against its scalar reference and against pixman's
// separable convolution filter with the same five weights.
#include <benchmark/benchmark.h>
#include <pixman.h>

#include <cstdlib>
#include <cstring>
#include <memory>
#include <random>
#include <vector>

#include "ratio.h"
#include "texture/texturecache.h"
#include "util/memorymanager/memorymanager.h"

namespace {

const int kBlocks = 8192;

// A fragmented pool: every block allocated, then the freed pattern released.
struct fragmented_pool {
    std::unique_ptr<memorymanager> pool;
    std::vector<allocatedmemory_autopointer> kept;
    size_t moved = 0;  // bytes the compaction will move
    size_t freed = 0;

    fragmented_pool(int freeEvery, const std::vector<unsigned int>& sizes) {
        size_t total = 0;
        for (unsigned int s : sizes) total += (s + 7) & ~7u;
        pool.reset(new memorymanager(unsigned(total)));
        std::vector<allocatedmemory_autopointer> all;
        all.reserve(sizes.size());
        for (unsigned int s : sizes) {
            all.push_back(pool->allocate(s));
            std::memset(all.back().get(), 0x5A, s);
        }
        kept.reserve(all.size());
        size_t p = 0;
        for (size_t i = 0; i < all.size(); ++i) {
            if (int(i % size_t(freeEvery)) == 0) {
                freed += size_t(all[i].length());
                continue;
            }
            p = (p + 7) & ~size_t(7);
            if (pool->base + p != all[i].get()) moved += size_t(all[i].length());
            p += size_t(all[i].length());
            kept.push_back(all[i]);
        }
    }
};

std::vector<unsigned int> block_sizes() {
    std::mt19937 rng(1234);
    std::vector<unsigned int> sizes(kBlocks);
    for (auto& s : sizes) s = 16 + rng() % 2033;
    return sizes;
}

void BM_PoolCompaction(benchmark::State& state) {
    const int freeEvery = int(state.range(0));
    const std::vector<unsigned int> sizes = block_sizes();
    size_t moved = 0;
    for (auto _ : state) {
        state.PauseTiming();
        std::unique_ptr<fragmented_pool> f(new fragmented_pool(freeEvery, sizes));
        moved = f->moved;
        state.ResumeTiming();
        benchmark::DoNotOptimize(f->pool->defragment());
        benchmark::ClobberMemory();
        state.PauseTiming();
        f.reset();
        state.ResumeTiming();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(moved));
    state.counters["moved_bytes"] = double(moved);
}
BENCHMARK(BM_PoolCompaction)->Arg(2)->ArgName("free_every")->UseRealTime()->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_PoolCompaction)->Arg(16)->ArgName("free_every")->UseRealTime()->Unit(benchmark::kMicrosecond);

void BM_MemmoveSameBytes(benchmark::State& state) {
    const int freeEvery = int(state.range(0));
    size_t moved, freed, total;
    {
        fragmented_pool f(freeEvery, block_sizes());
        moved = f.moved;
        freed = f.freed;
        total = f.pool->capacity;
    }
    unsigned char* buf = static_cast<unsigned char*>(std::aligned_alloc(128, (total + 127) & ~size_t(127)));
    std::memset(buf, 0x5A, total);
    for (auto _ : state) {
        std::memmove(buf, buf + freed, moved);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * int64_t(moved));
    std::free(buf);
}
BENCHMARK(BM_MemmoveSameBytes)->Arg(2)->ArgName("free_every")->UseRealTime()->Unit(benchmark::kMicrosecond);
BENCHMARK(BM_MemmoveSameBytes)->Arg(16)->ArgName("free_every")->UseRealTime()->Unit(benchmark::kMicrosecond);

PAVOQEN_RATIO("pool_compaction_half_vs_memmove", "BM_PoolCompaction/free_every:2/real_time",
              "BM_MemmoveSameBytes/free_every:2/real_time");
PAVOQEN_RATIO("pool_compaction_sparse_vs_memmove", "BM_PoolCompaction/free_every:16/real_time",
              "BM_MemmoveSameBytes/free_every:16/real_time");

// --- textures ----------------------------------------------------------------------

std::vector<unsigned int> random_texture(unsigned int seed) {
    std::mt19937 rng(seed);
    std::vector<unsigned int> t(128 * 128);
    for (auto& p : t) p = rng() | 0xFF000000u;
    return t;
}

void BM_TextureUpload(benchmark::State& state) {
    texturecache* cache = texturecache::create(nullptr, 1024);
    std::vector<unsigned int> px = random_texture(7);
    texturemetrics m;
    m.set(0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 0, 1, 1, 0, 0, 0, 0);
    unsigned short id = 0;
    for (auto _ : state) {
        cache->upload_texture(id, reinterpret_cast<const int*>(px.data()), m);
        id = (unsigned short)((id + 1) % 1024);  // every upload evicts once the cache is full
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations());
    texturecache::destroy(cache);
}
BENCHMARK(BM_TextureUpload);

template <bool Scalar>
void BM_TextureBlur(benchmark::State& state) {
    std::vector<unsigned int> px = random_texture(9);
    std::vector<unsigned int> slot(128 * 256);
    for (auto _ : state) {
        if (Scalar)
            texturecache::copy_and_blur_texture_scalar(px.data(), slot.data(), true, true, true);
        else
            texturecache::copy_and_blur_texture(px.data(), slot.data(), true, true, true);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations());
}
BENCHMARK_TEMPLATE(BM_TextureBlur, false);
BENCHMARK_TEMPLATE(BM_TextureBlur, true);

// pixman: 128 x 128 a8r8g8b8 through a 5 x 5 separable convolution with the
// same (normalised) weights, wrapping at the edges.
void BM_PixmanSeparableBlur(benchmark::State& state) {
    std::vector<unsigned int> px = random_texture(9);
    std::vector<unsigned int> out(128 * 128, 0);
    pixman_image_t* src = pixman_image_create_bits(PIXMAN_a8r8g8b8, 128, 128, px.data(), 512);
    pixman_image_t* dst = pixman_image_create_bits(PIXMAN_a8r8g8b8, 128, 128, out.data(), 512);
    const double w[5] = {0.053990968, 0.24197072, 0.3989423, 0.24197072, 0.053990968};
    double sum = 0;
    for (double x : w) sum += x;
    pixman_fixed_t params[14];
    params[0] = pixman_int_to_fixed(5);
    params[1] = pixman_int_to_fixed(5);
    params[2] = 0;
    params[3] = 0;
    for (int k = 0; k < 5; ++k) params[4 + k] = params[9 + k] = pixman_double_to_fixed(w[k] / sum);
    pixman_image_set_filter(src, PIXMAN_FILTER_SEPARABLE_CONVOLUTION, params, 14);
    pixman_image_set_repeat(src, PIXMAN_REPEAT_NORMAL);
    pixman_image_composite32(PIXMAN_OP_SRC, src, nullptr, dst, 0, 0, 0, 0, 0, 0, 128, 128);
    if (out == px) state.SkipWithError("pixman did not apply the convolution");
    for (auto _ : state) {
        pixman_image_composite32(PIXMAN_OP_SRC, src, nullptr, dst, 0, 0, 0, 0, 0, 0, 128, 128);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(state.iterations());
    pixman_image_unref(src);
    pixman_image_unref(dst);
}
BENCHMARK(BM_PixmanSeparableBlur);

PAVOQEN_RATIO("texture_blur_vs_scalar_reference", "BM_TextureBlur<false>", "BM_TextureBlur<true>");
PAVOQEN_RATIO("texture_blur_vs_pixman_convolution", "BM_TextureBlur<false>", "BM_PixmanSeparableBlur");

}  // namespace
