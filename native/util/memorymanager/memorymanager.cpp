#include "util/memorymanager/memorymanager.h"

#include <cstdint>
#include <cstdio>
#include <cstring>
#include <type_traits>

#include "jni/Exception.h"
#include "util/memorymanager/aligned.h"

static_assert(std::is_standard_layout<allocatedmemory>::value, "link must be reachable from the block");
static_assert(std::is_standard_layout<allocatedmemory_autopointer>::value, "link must be reachable from the holder");

std::atomic<int> allocatedmemory::allocated_size{0};

static void add_allocated(long long delta) {
    allocatedmemory::allocated_size.fetch_add(int((unsigned int)(long long)delta));
}

// --- allocatedmemory -------------------------------------------------------

void allocatedmemory::set_address(unsigned char* to) {
    address = to;
    for (linkable* h = holders.next; h != &holders; h = h->next) allocatedmemory_autopointer::from_link(h)->address = to;
}

void allocatedmemory::relocate(unsigned char* to) {
    if (to == address) return;
    std::memmove(to, address, size_t(length));
    set_address(to);
}

void allocatedmemory::resize(int newlength) {
    if (newlength < 0 || newlength > length) throw new IllegalArgumentException("newlength<=length");
    add_allocated((long long)newlength - length);
    length = newlength;
}

void allocatedmemory::invalidate() {
    add_allocated(-(long long)length);
    length = 0;
    set_address(nullptr);
}

void allocatedmemory::deallocate() {
    add_allocated(-(long long)length);
    length = 0;
    link.unlink();
    set_address(nullptr);
    delete this;
}

// --- allocatedmemory_autopointer ---------------------------------------------

void allocatedmemory_autopointer::attach(allocatedmemory* b) {
    block = b;
    if (!b) {
        address = nullptr;
        return;
    }
    b->holders.insert_after(link);
    address = b->address;
}

void allocatedmemory_autopointer::release() {
    if (!block) return;
    link.unlink();
    allocatedmemory* b = block;
    block = nullptr;
    address = nullptr;
    if (b->holders.empty_head()) b->deallocate();
}

void allocatedmemory_autopointer::resize(unsigned int newlength) {
    if (!block) throw new NullPointerException();
    if (newlength > 0x7FFFFFFFu) throw new IllegalArgumentException("newlength<=length");
    block->resize(int(newlength));
}

// --- memorymanager -----------------------------------------------------------

static inline unsigned long long round_up(unsigned long long v, unsigned int alignment) {
    return (v + alignment - 1) & ~(unsigned long long)(alignment - 1);
}

memorymanager::memorymanager(unsigned int cap) : capacity(cap), base(nullptr) {
    blocks.init_head();
    if (cap > kMaxCapacity) throw new IllegalArgumentException("pool capacity out of range");
    base = static_cast<unsigned char*>(_aligned_malloc(cap + kTail, 128));
    std::memset(base, 0, cap);
}

memorymanager::~memorymanager() { release_resources(); }

void memorymanager::release_resources() {
    // Oldest first. Each block is emptied and detached from this pool, so its
    // holders (which may outlive the pool) see null and free only the record.
    while (!blocks.empty_head()) {
        allocatedmemory* b = oldest();
        b->invalidate();
        b->link.unlink();
        b->owner = nullptr;
    }
    if (base) _aligned_free(base);
    base = nullptr;
}

int memorymanager::block_count() const {
    int n = 0;
    for (const linkable* l = blocks.next; l != &blocks; l = l->next) ++n;
    return n;
}

allocatedmemory_autopointer memorymanager::allocate(unsigned int size) { return allocate(size, 8); }

namespace {
struct monitor_scope {
    memorymanager& m;
    explicit monitor_scope(memorymanager& pool) : m(pool) { m.monitor_enter(); }
    ~monitor_scope() { m.monitor_exit(); }
};
}  // namespace

allocatedmemory_autopointer memorymanager::allocate(unsigned int size, unsigned int alignment) {
    if (alignment < 8) alignment = 8;
    if (alignment > 128 || (alignment & (alignment - 1)) != 0)
        throw new IllegalArgumentException("block alignment must be a power of two up to 128");
    monitor_scope lock(*this);
    unsigned char* at = findspace(size, alignment, true);
    allocatedmemory* b = new allocatedmemory();
    b->address = at;
    b->length = int(size);
    b->alignment = alignment;
    b->owner = this;
    blocks.insert_after(b->link);
    add_allocated(size);
    return allocatedmemory_autopointer(b);
}

unsigned char* memorymanager::findspace(unsigned int size, unsigned int alignment) {
    return findspace(size, alignment, true);
}

unsigned char* memorymanager::findspace(unsigned int size, unsigned int alignment, bool maycollect) {
    if (alignment < 8) alignment = 8;
    // A block that can never fit would only grow the pool until growth fails.
    if (size > kMaxCapacity) throw new IllegalArgumentException("block size out of range");
    for (;;) {
        if (!base) throw new IllegalStateException("memory pool released");
        if (blocks.empty_head()) {
            if (size <= capacity) return base;
        } else {
            unsigned long long e = round_up((unsigned long long)(newest()->endadr() - base), alignment);
            if (e + size <= capacity) return base + e;
            unsigned long long d = round_up((unsigned long long)(defragment() - base), alignment);
            if (d + size <= capacity) return base + d;
        }
        if (maycollect) {
            // Java may release blocks (finalised peers) during the collection.
            garbagecollect();
            if (!base) throw new IllegalStateException("memory pool released");
            defragment();
            if (get_free_space() < kLowWater) resizepool();
            maycollect = false;
        } else {
            resizepool();
        }
    }
}

unsigned char* memorymanager::defragment() {
    // Blocks are in address order from oldest to newest and every target lies
    // at or below its source, so moving in that order never overwrites a block
    // not yet moved. Neighbouring blocks that shift by the same distance are
    // moved together with one memmove.
    unsigned long long p = 0;
    unsigned char* runSrc = nullptr;
    unsigned char* runDst = nullptr;
    size_t runLen = 0;
    auto flush = [&] {
        if (runLen) std::memmove(runDst, runSrc, runLen);
        runLen = 0;
    };
    for (linkable* l = blocks.prev; l != &blocks; l = l->prev) {
        allocatedmemory* b = allocatedmemory::from_link(l);
        p = round_up(p, b->alignment);
        unsigned char* to = base + p;
        unsigned char* from = b->address;
        if (to != from) {
            bool extends = runLen && (from - to) == (runSrc - runDst) && from >= runSrc + runLen &&
                           size_t(from - (runSrc + runLen)) < 256;
            if (extends) {
                runLen = size_t(from + b->length - runSrc);
            } else {
                flush();
                runSrc = from;
                runDst = to;
                runLen = size_t(b->length);
            }
            b->set_address(to);
        } else {
            flush();
        }
        p += (unsigned int)b->length;
    }
    flush();
    return base + p;
}

unsigned char* memorymanager::grow_buffer(unsigned char* old, unsigned int oldsize, unsigned int newsize) {
    return static_cast<unsigned char*>(_aligned_realloc(old, oldsize, newsize, 128));
}

void memorymanager::resizepool() {
    if (!base) throw new IllegalStateException("memory pool released");
    // capacity x 1.1f rounded once to single precision, then truncated: the
    // exact product capacity x 9227469 / 2^23 converted to float.
    unsigned long long exact = (unsigned long long)capacity * 9227469ull;
    float product = float(exact) * (1.0f / 8388608.0f);
    unsigned long long grown = (unsigned long long)product;
    if (grown < (unsigned long long)capacity + 8) grown = (unsigned long long)capacity + 8;
    unsigned char* nb = nullptr;
    if (grown <= kMaxCapacity) nb = grow_buffer(base, capacity + kTail, unsigned(grown) + kTail);
    if (!nb) {
        char msg[200];
        std::snprintf(msg, sizeof msg, "native(MPR: %d)", int(grown / 1024));
        throw new OutOfMemory(msg);
    }
    unsigned char* old = base;
    base = nb;
    capacity = unsigned(grown);
    if (nb != old) {
        for (linkable* l = blocks.prev; l != &blocks; l = l->prev) {
            allocatedmemory* b = allocatedmemory::from_link(l);
            b->set_address(nb + (reinterpret_cast<uintptr_t>(b->address) - reinterpret_cast<uintptr_t>(old)));
        }
    }
}

unsigned int memorymanager::get_free_space() const {
    if (blocks.empty_head()) return capacity;
    long long used = newest()->endadr() - base;
    return used >= (long long)capacity ? 0u : unsigned(capacity - used);
}

int memorymanager::get_size() const { return allocatedmemory::allocated_size.load(); }
