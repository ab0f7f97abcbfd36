// Memory pools, holders, typed arrays and the aligned allocators.
#include <gtest/gtest.h>

#include <xmmintrin.h>

#include <cstdint>
#include <cstring>
#include <functional>
#include <map>
#include <memory>
#include <random>
#include <string>
#include <vector>

#include "jni/Exception.h"
#include "render/callbacks.h"
#include "render/memorypool.h"
#include "render/toolkit.h"
#include "util/memorymanager/memorymanager.h"
#include "util/memorymanager/sharedarray.h"

namespace {

// Runs `f` and returns the native exception it throws (owned by the caller),
// or null if none.
template <class F>
std::unique_ptr<Exception> catch_native(F&& f) {
    try {
        f();
    } catch (Exception* e) {
        return std::unique_ptr<Exception>(e);
    }
    return nullptr;
}

template <class E, class F>
void expect_throws(F&& f, const char* message = nullptr) {
    std::unique_ptr<Exception> e = catch_native(f);
    ASSERT_TRUE(e != nullptr) << "no exception";
    EXPECT_TRUE(dynamic_cast<E*>(e.get()) != nullptr) << "wrong kind, message: " << e->what();
    if (message) {
        EXPECT_STREQ(e->what(), message);
    }
}

std::ptrdiff_t off(const memorymanager& pool, const unsigned char* p) { return p - pool.base; }

// A pool whose collection hook and buffer growth are scripted by the test.
class test_pool : public memorymanager {
public:
    explicit test_pool(unsigned int capacity) : memorymanager(capacity) {}
    void garbagecollect() override {
        ++collections;
        if (on_collect) on_collect();
    }
    unsigned char* grow_buffer(unsigned char* old, unsigned int oldsize, unsigned int newsize) override {
        ++growths;
        if (fail_growth) return nullptr;
        return memorymanager::grow_buffer(old, oldsize, newsize);
    }
    int collections = 0;
    int growths = 0;
    bool fail_growth = false;
    std::function<void()> on_collect;
};

void fill(const allocatedmemory_autopointer& h, unsigned char seed) {
    for (int i = 0; i < h.length(); ++i) h.get()[i] = (unsigned char)(seed + i * 7);
}
bool holds(const allocatedmemory_autopointer& h, unsigned char seed) {
    for (int i = 0; i < h.length(); ++i)
        if (h.get()[i] != (unsigned char)(seed + i * 7)) return false;
    return true;
}

TEST(MemoryPool, PlacementCollectionAndGrowth) {
    {
        test_pool pool(1000);
        auto a = pool.allocate(100);
        auto b = pool.allocate(100);
        auto d = pool.allocate(5, 64);
        EXPECT_EQ(off(pool, b.get()), 104);
        EXPECT_EQ(off(pool, d.get()), 256);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(pool.base) % 128, 0u);
        for (int i = 0; i < 100; ++i) EXPECT_EQ(a.get()[i], 0);  // a fresh pool is zeroed
        pool.resizepool();
        EXPECT_EQ(pool.capacity, 1100u);  // grows by a tenth
    }
    {   // The collection frees enough: compaction, no growth.
        test_pool pool(1000000);
        std::unique_ptr<allocatedmemory_autopointer> big(new allocatedmemory_autopointer(pool.allocate(700000)));
        auto keep = pool.allocate(1000);
        fill(keep, 9);
        pool.on_collect = [&] { big.reset(); };
        auto more = pool.allocate(500000);
        EXPECT_EQ(pool.collections, 1);
        EXPECT_EQ(pool.growths, 0);
        EXPECT_EQ(off(pool, more.get()), 1000);
        EXPECT_TRUE(holds(keep, 9));
    }
    {   // Nothing freed: one collection first, then growth.
        test_pool pool(1000);
        unsigned int capacityAtCollect = 0;
        pool.on_collect = [&] { capacityAtCollect = pool.capacity; };
        auto a = pool.allocate(800);
        auto b = pool.allocate(800);
        EXPECT_EQ(pool.collections, 1);
        EXPECT_EQ(capacityAtCollect, 1000u);
        EXPECT_GE(pool.capacity, 1600u);
    }
    {   // Tiny and empty pools grow instead of stalling.
        test_pool pool(0);
        auto a = pool.allocate(5000);
        EXPECT_GE(pool.capacity, 5000u);
    }
}

TEST(MemoryPool, RefusedSizesAndFailedGrowthKeepThePool) {
    expect_throws<IllegalArgumentException>([] { memorymanager pool(0x80000000u); });
    {
        test_pool pool(1000);
        expect_throws<IllegalArgumentException>([&] { pool.allocate(0xFFFFFF00u); });  // never fits
        expect_throws<IllegalArgumentException>([&] { sharedarray<int>(&pool, 0x40000000u); });
        expect_throws<IllegalArgumentException>([&] { pool.allocate(16, 24); });
        EXPECT_EQ(pool.growths, 0);
        // Growth past the limit raises OutOfMemory instead of wrapping (capacity faked).
        pool.capacity = memorymanager::kMaxCapacity - 10;
        expect_throws<OutOfMemory>([&] { pool.resizepool(); });
        EXPECT_EQ(pool.capacity, memorymanager::kMaxCapacity - 10);
        pool.capacity = 1000;
    }
    test_pool pool(10485760);
    auto a = pool.allocate(10485000);
    fill(a, 21);
    unsigned char* oldBase = pool.base;
    pool.fail_growth = true;
    expect_throws<OutOfMemory>([&] { pool.allocate(4096); }, "native(MPR: 11264)");
    EXPECT_EQ(pool.capacity, 10485760u);
    EXPECT_EQ(pool.base, oldBase);
    EXPECT_TRUE(holds(a, 21));
}

TEST(MemoryPool, HoldersOutlivingTheirPoolAreLeftEmpty) {
    int before = allocatedmemory::allocated_size.load();
    sharedarray<int> kept;
    allocatedmemory_autopointer raw;
    {
        memorymanager pool(4096);
        kept = sharedarray<int>(&pool, 10);
        raw = pool.allocate(64);
    }
    EXPECT_EQ(kept.data(), nullptr);
    EXPECT_EQ(raw.get(), nullptr);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { kept.at(0); });
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);
    // Releasing a pool's resources empties holders and refuses further allocations.
    memorymanager pool(4096);
    auto h = pool.allocate(32);
    pool.release_resources();
    EXPECT_EQ(h.get(), nullptr);
    expect_throws<IllegalStateException>([&] { pool.allocate(8); });
}

class recording_callbacks : public toolkit_callbacks {
public:
    bool request_texture(unsigned short) override { return false; }
    void garbagecollect() override {
        ++collections;
        if (on_collect) on_collect();
    }
    void* createshadow() override { return nullptr; }
    int collections = 0;
    std::function<void()> on_collect;
};

TEST(MemoryPool, JavaPoolAsksTheToolkitToCollect) {
    unsigned int mxcsr = _mm_getcsr();
    auto* cb = new recording_callbacks();
    toolkit* tk = toolkit::create(cb, false, 0);
    {
        memorypool pool(*tk, 2000);
        sharedarray<unsigned char> a(&pool, 1500);
        std::unique_ptr<sharedarray<unsigned char>> b(new sharedarray<unsigned char>(&pool, 400));
        cb->on_collect = [&] { b.reset(); };
        sharedarray<unsigned char> c(&pool, 450);
        EXPECT_EQ(cb->collections, 1);
        EXPECT_EQ(pool.capacity, 2200u);  // small free tail: grows after the collection
        EXPECT_EQ(off(pool, c.data()), 1504);
        cb->on_collect = nullptr;
    }
    toolkit::destroy(tk);
    _mm_setcsr(mxcsr);
}

TEST(SharedArray, BoundsSharingAndRows) {
    memorymanager pool(8192);
    sharedarray<int> empty;
    expect_throws<NullPointerException>([&] { empty.at(0); });
    expect_throws<NullPointerException>([&] { sharedarray<int>(nullptr, 3); });
    sharedarray<int> a(&pool, 5);
    std::unique_ptr<Exception> e = catch_native([&] { a.at(5); });
    auto* oob = dynamic_cast<ArrayIndexOutOfBoundsException*>(e.get());
    ASSERT_TRUE(oob);
    EXPECT_EQ(oob->index, 5);
    EXPECT_EQ(oob->length, 5);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { a.at(-1); });
    sharedarray<int> b = a;
    b[2] = 77;
    EXPECT_EQ(a[2], 77);
    a.shrink(3);
    EXPECT_EQ(b.count(), 3);
    expect_throws<IllegalArgumentException>([&] { a.shrink(4); });

    const unsigned int counts[4] = {3, 0, 5, 1};
    sharedarray2d<unsigned short> labels(&pool, counts, 4);
    EXPECT_EQ(labels.row_count(2), 5u);
    EXPECT_EQ(labels.row(3) - labels.row(0), 8);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { labels.row(4); });
}

// Randomised allocate / free / copy / assign / shrink / compact / grow steps
// against a model of what every holder must see. The seed is the case number.
struct stress_model {
    explicit stress_model(unsigned int seed) : rng(seed), pool(2048) {
        // A finaliser that drops a random holder during the collection.
        pool.on_collect = [this] { if (!holders.empty() && pick(3) == 0) drop(pick(int(holders.size()))); };
    }
    int pick(int n) { return int(rng() % unsigned(n)); }
    void drop(int i) {
        holders.erase(holders.begin() + i);
        keys.erase(keys.begin() + i);
    }
    void step() {
        int op = pick(100);
        if (op < 40 || holders.empty()) {
            static const unsigned int aligns[] = {1, 4, 8, 16, 32, 64, 128};
            unsigned int size = pick(4) == 0 ? unsigned(pick(3000)) : unsigned(pick(200));
            unsigned int align = aligns[pick(7)];
            holders.emplace_back(new allocatedmemory_autopointer(pool.allocate(size, align)));
            std::vector<unsigned char> bytes(size);
            for (auto& b : bytes) b = (unsigned char)rng();
            if (size) std::memcpy(holders.back()->get(), bytes.data(), size);
            contents[nextkey] = bytes;
            alignments[nextkey] = align < 8 ? 8 : align;
            keys.push_back(nextkey++);
            return;
        }
        int i = pick(int(holders.size())), j = pick(int(holders.size()));
        std::vector<unsigned char>& bytes = contents[keys[i]];
        if (op < 65) {
            drop(i);
        } else if (op < 75) {
            holders.emplace_back(new allocatedmemory_autopointer(*holders[i]));
            keys.push_back(keys[i]);
        } else if (op < 82) {
            *holders[i] = *holders[j];
            keys[i] = keys[j];
        } else if (op < 92 && !bytes.empty()) {
            size_t n = size_t(pick(int(bytes.size()) + 1));
            holders[i]->resize(unsigned(n));
            bytes.resize(n);
        } else if (op < 97) {
            pool.defragment();
        } else {
            pool.resizepool();
        }
    }
    void check() {
        std::map<allocatedmemory*, int> holderCount;
        long long live = 0;
        for (size_t i = 0; i < holders.size(); ++i) {
            allocatedmemory* b = holders[i]->get_block();
            ASSERT_TRUE(b);
            ASSERT_EQ(holders[i]->get(), b->address);
            const std::vector<unsigned char>& bytes = contents[keys[i]];
            ASSERT_EQ(size_t(b->length), bytes.size());
            ASSERT_EQ(reinterpret_cast<uintptr_t>(b->address) % alignments[keys[i]], 0u);
            ASSERT_TRUE(bytes.empty() || std::memcmp(b->address, bytes.data(), bytes.size()) == 0) << keys[i];
            holderCount[b]++;
        }
        // Blocks in address order, inside the capacity, each with the expected holders.
        const unsigned char* end = pool.base;
        for (linkable* l = pool.blocks.prev; l != &pool.blocks; l = l->prev) {
            allocatedmemory* b = allocatedmemory::from_link(l);
            ASSERT_GE(b->address, end);
            end = b->endadr();
            ASSERT_LE(end, pool.base + pool.capacity);
            int n = 0;
            for (linkable* h = b->holders.next; h != &b->holders; h = h->next) ++n;
            ASSERT_EQ(n, holderCount[b]);
            live += b->length;
        }
        ASSERT_EQ(size_t(pool.block_count()), holderCount.size());
        ASSERT_EQ(allocatedmemory::allocated_size.load() - baseline, live);
    }

    std::mt19937 rng;
    test_pool pool;
    int baseline = allocatedmemory::allocated_size.load();
    std::vector<std::unique_ptr<allocatedmemory_autopointer>> holders;
    std::vector<int> keys;
    std::map<int, std::vector<unsigned char>> contents;
    std::map<int, unsigned int> alignments;
    int nextkey = 0;
};

TEST(MemoryPool, RandomisedStress) {
    for (unsigned int seed = 1; seed <= 24; ++seed) {
        stress_model m(seed);
        for (int s = 0; s < 600; ++s) {
            m.step();
            SCOPED_TRACE("case " + std::to_string(seed) + " step " + std::to_string(s));
            m.check();
            if (::testing::Test::HasFatalFailure()) return;
        }
        EXPECT_GT(m.pool.collections, 0) << "case " << seed;
        m.holders.clear();
        EXPECT_EQ(m.pool.block_count(), 0);
        EXPECT_EQ(allocatedmemory::allocated_size.load(), m.baseline);
    }
}

}  // namespace
