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
#include "util/memorymanager/aligned.h"
#include "util/memorymanager/memorymanager.h"
#include "util/memorymanager/sharedarray.h"
#include "util/memorymanager/simplearray.h"

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

TEST(MemoryPool, PlacementInAllocationOrder) {
    test_pool pool(4096);
    auto a = pool.allocate(100);
    auto b = pool.allocate(100);
    auto c = pool.allocate(100);
    EXPECT_EQ(off(pool, a.get()), 0);
    EXPECT_EQ(off(pool, b.get()), 104);
    EXPECT_EQ(off(pool, c.get()), 208);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(pool.base) % 128, 0u);
    EXPECT_EQ(pool.get_free_space(), 4096u - 308u);
    auto d = pool.allocate(5, 64);
    EXPECT_EQ(off(pool, d.get()), 320);
    EXPECT_EQ(pool.block_count(), 4);
    EXPECT_EQ(pool.collections, 0);
    // A fresh pool is zeroed.
    for (int i = 0; i < 100; ++i) EXPECT_EQ(a.get()[i], 0);
}

TEST(MemoryPool, CompactionMovesLaterBlocksAndTheirHolders) {
    test_pool pool(1000);
    auto a = pool.allocate(100);
    auto b = pool.allocate(300);
    auto c = pool.allocate(200, 16);
    allocatedmemory_autopointer c2 = c;  // a second holder of the third block
    fill(a, 1);
    fill(c, 3);
    EXPECT_EQ(off(pool, c.get()), 416);
    b.reset();
    // 1000 - 600 = 400 bytes left at the tail; 500 fit only after compaction.
    auto d = pool.allocate(500);
    EXPECT_EQ(pool.collections, 0);
    EXPECT_EQ(pool.growths, 0);
    EXPECT_EQ(off(pool, c.get()), 112);  // 100 rounded up to 16
    EXPECT_EQ(c2.get(), c.get());
    EXPECT_EQ(c.get_block()->address, c.get());
    EXPECT_EQ(off(pool, d.get()), 312);
    EXPECT_TRUE(holds(a, 1));
    EXPECT_TRUE(holds(c, 3));
}

TEST(MemoryPool, CollectsBeforeGrowingAndGrowsOnlyWhenStillShort) {
    // Large pool: the collection frees enough, so no growth.
    {
        test_pool pool(1000000);
        std::unique_ptr<allocatedmemory_autopointer> big(new allocatedmemory_autopointer(pool.allocate(700000)));
        auto keep = pool.allocate(1000);
        fill(keep, 9);
        pool.on_collect = [&] { big.reset(); };
        auto more = pool.allocate(500000);
        EXPECT_EQ(pool.collections, 1);
        EXPECT_EQ(pool.growths, 0);
        EXPECT_EQ(pool.capacity, 1000000u);
        EXPECT_EQ(off(pool, keep.get()), 0);
        EXPECT_EQ(off(pool, more.get()), 1000);
        EXPECT_TRUE(holds(keep, 9));
    }
    // Nothing freed: one collection, then growth until the block fits.
    {
        test_pool pool(1000);
        unsigned int capacityAtCollect = 0;
        pool.on_collect = [&] { capacityAtCollect = pool.capacity; };
        auto a = pool.allocate(800);
        fill(a, 5);
        auto b = pool.allocate(800);
        EXPECT_EQ(pool.collections, 1);
        EXPECT_EQ(capacityAtCollect, 1000u);
        EXPECT_GE(pool.capacity, 1600u);
        EXPECT_EQ(off(pool, b.get()), 800);
        EXPECT_TRUE(holds(a, 5));
    }
    // An empty pool still grows for a block larger than its capacity.
    {
        test_pool pool(100);
        auto a = pool.allocate(5000);
        EXPECT_GE(pool.capacity, 5000u);
        EXPECT_EQ(a.get(), pool.base);
    }
    // Tiny pools grow by at least a few bytes instead of stalling.
    {
        test_pool pool(0);
        auto a = pool.allocate(40);
        EXPECT_GE(pool.capacity, 40u);
    }
}

TEST(MemoryPool, GrowthFactorAndKeptAlignment) {
    {
        test_pool pool(1000);
        pool.resizepool();
        EXPECT_EQ(pool.capacity, 1100u);
    }
    {
        test_pool pool(16777217);
        auto a = pool.allocate(1000, 128);
        auto b = pool.allocate(48, 16);
        auto c = pool.allocate(3, 64);
        fill(a, 11);
        fill(b, 12);
        fill(c, 13);
        unsigned char* oldBase = pool.base;
        pool.resizepool();
        EXPECT_EQ(pool.capacity, 18454940u);
        EXPECT_NE(pool.base, oldBase);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(pool.base) % 128, 0u);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(a.get()) % 128, 0u);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(b.get()) % 16, 0u);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(c.get()) % 64, 0u);
        EXPECT_EQ(off(pool, a.get()), 0);
        EXPECT_EQ(off(pool, b.get()), 1008);
        EXPECT_EQ(off(pool, c.get()), 1088);
        EXPECT_TRUE(holds(a, 11));
        EXPECT_TRUE(holds(b, 12));
        EXPECT_TRUE(holds(c, 13));
    }
}

TEST(MemoryPool, FailedGrowthReportsNewSizeAndKeepsThePool) {
    test_pool pool(10485760);
    auto a = pool.allocate(10485000);
    fill(a, 21);
    unsigned char* oldBase = pool.base;
    pool.fail_growth = true;
    expect_throws<OutOfMemory>([&] { pool.allocate(4096); }, "native(MPR: 11264)");
    EXPECT_EQ(pool.collections, 1);
    EXPECT_EQ(pool.capacity, 10485760u);
    EXPECT_EQ(pool.base, oldBase);
    EXPECT_EQ(pool.block_count(), 1);
    EXPECT_TRUE(holds(a, 21));
}

TEST(MemoryPool, SizesBeyondThirtyTwoBitsAreRefused) {
    expect_throws<IllegalArgumentException>([] { memorymanager pool(0x80000000u); });
    expect_throws<IllegalArgumentException>([] { memorymanager pool(0xFFFFFFFFu); });
    test_pool pool(1000);
    // A block that could never fit is refused without growing the pool.
    expect_throws<IllegalArgumentException>([&] { pool.allocate(0xFFFFFF00u); });
    EXPECT_EQ(pool.growths, 0);
    expect_throws<IllegalArgumentException>([&] { sharedarray<int>(&pool, 0x40000000u); });
    expect_throws<IllegalArgumentException>([&] { pool.allocate(16, 256); });
    expect_throws<IllegalArgumentException>([&] { pool.allocate(16, 24); });
    // Growth past the limit raises OutOfMemory instead of wrapping; the buffer
    // is not touched (the capacity is faked, no block lies beyond 1000).
    pool.capacity = memorymanager::kMaxCapacity - 10;
    expect_throws<OutOfMemory>([&] { pool.resizepool(); });
    EXPECT_EQ(pool.growths, 0);
    EXPECT_EQ(pool.capacity, memorymanager::kMaxCapacity - 10);
    pool.capacity = 1000;
}

TEST(MemoryPool, ReferenceCountingAndAllocatedSize) {
    int before = allocatedmemory::allocated_size.load();
    test_pool pool(4096);
    EXPECT_EQ(pool.get_size(), before);
    std::unique_ptr<allocatedmemory_autopointer> first(new allocatedmemory_autopointer(pool.allocate(300)));
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before + 300);
    std::unique_ptr<allocatedmemory_autopointer> copy(new allocatedmemory_autopointer(*first));
    first.reset();
    EXPECT_EQ(pool.block_count(), 1);
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before + 300);
    EXPECT_NE(copy->get(), nullptr);
    copy->resize(120);
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before + 120);
    expect_throws<IllegalArgumentException>([&] { copy->resize(121); });
    copy.reset();
    EXPECT_EQ(pool.block_count(), 0);
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);

    // Assignment releases the old block and shares the new one; self-assignment keeps it.
    auto x = pool.allocate(10);
    auto y = pool.allocate(20);
    allocatedmemory_autopointer& xr = x;
    x = xr;
    EXPECT_EQ(pool.block_count(), 2);
    x = y;
    EXPECT_EQ(pool.block_count(), 1);
    EXPECT_EQ(x.get(), y.get());
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before + 20);
    allocatedmemory_autopointer empty;
    expect_throws<NullPointerException>([&] { empty.resize(0); });
    x = empty;
    y = empty;
    EXPECT_EQ(pool.block_count(), 0);
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);
}

TEST(MemoryPool, HoldersOutlivingTheirPoolAreLeftEmpty) {
    int before = allocatedmemory::allocated_size.load();
    sharedarray<int> kept;
    allocatedmemory_autopointer raw;
    {
        memorymanager pool(4096);
        kept = sharedarray<int>(&pool, 10);
        raw = pool.allocate(64);
        allocatedmemory_autopointer second = raw;
        EXPECT_EQ(kept.count(), 10);
    }
    EXPECT_EQ(kept.data(), nullptr);
    EXPECT_EQ(kept.count(), 0);
    EXPECT_EQ(raw.get(), nullptr);
    EXPECT_EQ(raw.length(), 0);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { kept.at(0); });
    sharedarray<int> copy = kept;  // copying a dead holder is harmless
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);
    kept.reset();
    raw.reset();
    copy.reset();

    // Releasing a pool's resources empties holders and refuses further allocations.
    memorymanager pool(4096);
    auto h = pool.allocate(32);
    pool.release_resources();
    EXPECT_EQ(h.get(), nullptr);
    EXPECT_EQ(pool.base, nullptr);
    expect_throws<IllegalStateException>([&] { pool.allocate(8); });
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);
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
        unsigned int capAtCollect = 0;
        cb->on_collect = [&] {
            capAtCollect = pool.capacity;
            b.reset();
        };
        sharedarray<unsigned char> c(&pool, 450);
        EXPECT_EQ(cb->collections, 1);
        EXPECT_EQ(capAtCollect, 2000u);
        // The small pool grows after the collection (its free tail is below 300 KiB).
        EXPECT_EQ(pool.capacity, 2200u);
        EXPECT_EQ(off(pool, c.data()), 1504);
        cb->on_collect = nullptr;
    }
    toolkit::destroy(tk);
    _mm_setcsr(mxcsr);
}

TEST(SharedArray, CountsAccessAndSharing) {
    memorymanager pool(8192);
    sharedarray<int> empty;
    EXPECT_EQ(empty.count(), 0);
    EXPECT_EQ(empty.data(), nullptr);
    EXPECT_EQ(empty.get_pool(), nullptr);
    expect_throws<NullPointerException>([&] { empty.at(0); });
    expect_throws<NullPointerException>([&] { sharedarray<int>(nullptr, 3); });

    sharedarray<int> zero(&pool, 0);
    EXPECT_FALSE(zero.isnull());
    EXPECT_EQ(zero.count(), 0);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { zero.at(0); });

    sharedarray<int> a(&pool, 5);
    EXPECT_EQ(a.get_pool(), &pool);
    for (int i = 0; i < 5; ++i) a.at(i) = i * 10;
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

    // 16-byte elements are 16-byte aligned; byte arrays only 8.
    struct alignas(16) vec4 {
        float x, y, z, w;
    };
    sharedarray<unsigned char> odd(&pool, 3);
    sharedarray<vec4> v(&pool, 2);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(v.data()) % 16, 0u);
    EXPECT_EQ(off(pool, odd.data()) % 8, 0);
}

TEST(SharedArray, ElementPointerIsStaleAfterCompaction) {
    memorymanager pool(256);
    sharedarray<int> first(&pool, 16);
    sharedarray<int> second(&pool, 16);
    for (int i = 0; i < 16; ++i) second[i] = 1000 + i;
    int* stale = second.data();
    first.reset();
    sharedarray<int> third(&pool, 40);  // 128 + 160 > 256: fits only after compaction
    EXPECT_NE(second.data(), stale);
    EXPECT_EQ(second.data(), reinterpret_cast<int*>(pool.base));
    for (int i = 0; i < 16; ++i) EXPECT_EQ(second[i], 1000 + i);
}

TEST(SharedArray, TwoDimensionalRows) {
    memorymanager pool(4096);
    const unsigned int counts[4] = {3, 0, 5, 1};
    sharedarray2d<unsigned short> labels(&pool, counts, 4);
    EXPECT_EQ(labels.rows(), 4);
    EXPECT_EQ(labels.elements.count(), 9);
    EXPECT_EQ(labels.row_count(2), 5u);
    EXPECT_EQ(labels.row(2) - labels.row(0), 3);
    EXPECT_EQ(labels.row(3) - labels.row(0), 8);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { labels.row(4); });
    sharedarray2d<unsigned short> none;
    expect_throws<NullPointerException>([&] { none.row(0); });
}

TEST(SimpleArray, ValueInitialisedAndReleasesElements) {
    simplearray<int> five(5);
    EXPECT_EQ(five.size(), 5);
    for (int i = 0; i < 5; ++i) EXPECT_EQ(five[i], 0);
    expect_throws<ArrayIndexOutOfBoundsException>([&] { five.at(5); });

    int before = allocatedmemory::allocated_size.load();
    memorymanager pool(4096);
    {
        simplearray<sharedarray<unsigned char>> arrays(3);
        EXPECT_TRUE(arrays[1].isnull());
        arrays[0] = sharedarray<unsigned char>(&pool, 100);
        arrays[2] = sharedarray<unsigned char>(&pool, 50);
        EXPECT_EQ(allocatedmemory::allocated_size.load(), before + 150);
    }
    EXPECT_EQ(pool.block_count(), 0);
    EXPECT_EQ(allocatedmemory::allocated_size.load(), before);
}

TEST(Linkable, UnlinkOfAnUnlinkedNode) {
    linkable head, a, b;
    head.init_head();
    EXPECT_FALSE(a.islinked());
    a.unlink();
    EXPECT_FALSE(a.islinked());
    head.insert_after(a);
    head.insert_after(b);
    EXPECT_EQ(head.next, &b);  // newest first
    EXPECT_EQ(head.prev, &a);  // oldest last
    b.unlink();
    EXPECT_FALSE(b.islinked());
    EXPECT_EQ(head.next, &a);
    EXPECT_EQ(a.next, &head);
}

TEST(Aligned, MallocAndReallocKeepAlignment) {
    void* p = _aligned_malloc(100, 4);
    EXPECT_EQ(reinterpret_cast<uintptr_t>(p) % 8, 0u);
    _aligned_free(p);
    for (int round = 0; round < 20; ++round) {
        unsigned char* q = static_cast<unsigned char*>(_aligned_malloc(1000, 128));
        for (int i = 0; i < 1000; ++i) q[i] = (unsigned char)(i * 3 + round);
        // Varying sizes so the allocator cannot always extend in place.
        unsigned char* r = static_cast<unsigned char*>(_aligned_realloc(q, 1000, 1000 + 4096 * round + 8, 128));
        ASSERT_NE(r, nullptr);
        EXPECT_EQ(reinterpret_cast<uintptr_t>(r) % 128, 0u);
        for (int i = 0; i < 1000; ++i) ASSERT_EQ(r[i], (unsigned char)(i * 3 + round));
        _aligned_free(r);
    }
}

// Randomised allocate / free / copy / assign / shrink / compact / grow steps
// against a model of what every holder must see. The seed is the case number.
class stress_model {
public:
    explicit stress_model(unsigned int seed) : rng(seed), pool(2048) {
        pool.on_collect = [this] {
            // A finaliser that drops a random holder during the collection.
            if (!holders.empty() && pick(3) == 0) drop(pick(int(holders.size())));
        };
    }

    int pick(int n) { return int(rng() % unsigned(n)); }

    void drop(int i) {
        holders.erase(holders.begin() + i);
        keys.erase(keys.begin() + i);
    }

    void step() {
        int op = pick(100);
        if (op < 35 || holders.empty()) {
            static const unsigned int aligns[] = {1, 4, 8, 16, 32, 64, 128};
            unsigned int size = pick(4) == 0 ? unsigned(pick(3000)) : unsigned(pick(200));
            unsigned int align = aligns[pick(7)];
            std::unique_ptr<allocatedmemory_autopointer> h(
                new allocatedmemory_autopointer(pool.allocate(size, align)));
            int key = nextkey++;
            std::vector<unsigned char> bytes(size);
            for (auto& b : bytes) b = (unsigned char)rng();
            if (size) std::memcpy(h->get(), bytes.data(), size);
            contents[key] = bytes;
            alignments[key] = align < 8 ? 8 : align;
            holders.push_back(std::move(h));
            keys.push_back(key);
        } else if (op < 60) {
            drop(pick(int(holders.size())));
        } else if (op < 70) {
            int i = pick(int(holders.size()));
            holders.emplace_back(new allocatedmemory_autopointer(*holders[i]));
            keys.push_back(keys[i]);
        } else if (op < 77) {
            int i = pick(int(holders.size())), j = pick(int(holders.size()));
            *holders[i] = *holders[j];
            keys[i] = keys[j];
        } else if (op < 85) {
            int i = pick(int(holders.size()));
            std::vector<unsigned char>& bytes = contents[keys[i]];
            if (!bytes.empty()) {
                size_t n = size_t(pick(int(bytes.size()) + 1));
                holders[i]->resize(unsigned(n));
                bytes.resize(n);
            }
        } else if (op < 92) {
            int i = pick(int(holders.size()));
            std::vector<unsigned char>& bytes = contents[keys[i]];
            for (size_t k = 0; k < bytes.size(); k += 1 + size_t(pick(8))) {
                bytes[k] = (unsigned char)rng();
                holders[i]->get()[k] = bytes[k];
            }
        } else if (op < 97) {
            pool.defragment();
        } else {
            pool.resizepool();
        }
    }

    void check(const std::string& where) {
        SCOPED_TRACE(where);
        std::map<allocatedmemory*, int> holderCount;
        long long live = 0;
        for (size_t i = 0; i < holders.size(); ++i) {
            const allocatedmemory_autopointer& h = *holders[i];
            allocatedmemory* b = h.get_block();
            ASSERT_TRUE(b);
            ASSERT_EQ(h.get(), b->address);
            const std::vector<unsigned char>& bytes = contents[keys[i]];
            ASSERT_EQ(size_t(b->length), bytes.size());
            ASSERT_EQ(reinterpret_cast<uintptr_t>(h.get()) % alignments[keys[i]], 0u);
            ASSERT_TRUE(bytes.empty() || std::memcmp(h.get(), bytes.data(), bytes.size()) == 0) << "key " << keys[i];
            holderCount[b]++;
        }
        // Blocks: in address order, inside the usable capacity, each with the
        // holders the model expects.
        const unsigned char* end = pool.base;
        int blocks = 0;
        for (linkable* l = pool.blocks.prev; l != &pool.blocks; l = l->prev) {
            allocatedmemory* b = allocatedmemory::from_link(l);
            ASSERT_GE(b->address, end);
            end = b->endadr();
            ASSERT_LE(end, pool.base + pool.capacity);
            int n = 0;
            for (linkable* h = b->holders.next; h != &b->holders; h = h->next) ++n;
            ASSERT_EQ(n, holderCount[b]);
            live += b->length;
            ++blocks;
        }
        ASSERT_EQ(size_t(blocks), holderCount.size());
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
            m.check("case " + std::to_string(seed) + " step " + std::to_string(s));
            if (::testing::Test::HasFatalFailure()) return;
        }
        EXPECT_GT(m.pool.collections, 0) << "case " << seed;
        m.holders.clear();
        m.keys.clear();
        EXPECT_EQ(m.pool.block_count(), 0);
        EXPECT_EQ(allocatedmemory::allocated_size.load(), m.baseline);
    }
}

}  // namespace
