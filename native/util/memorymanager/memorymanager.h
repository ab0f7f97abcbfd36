// Relocatable, compacting memory pools.
//
// A pool (memorymanager) is one large 128-byte aligned buffer in which blocks
// are placed one after another in allocation order. Each block is an
// allocatedmemory record; users hold it through allocatedmemory_autopointer,
// which caches the block's address and counts as a reference. Because every
// holder is known, the pool may move blocks: it compacts them towards the
// start and may move the whole buffer when it grows, rewriting every holder's
// cached address on each move. So never keep a raw element pointer across an
// allocation in the same pool; read it again through the holder.
//
// Holders must not live inside pool memory themselves (a move would break
// their links). Holders may outlive their pool: destroying or releasing the
// pool leaves them empty (null address, zero length).
#pragma once

#include <atomic>
#include <cstddef>

#include "util/memorymanager/linkable.h"

class memorymanager;
class allocatedmemory_autopointer;

// One block of a pool.
class allocatedmemory {
public:
    linkable link;  // membership in the pool's block list (first member)
    unsigned char* address = nullptr;  // null once invalidated
    int length = 0;
    unsigned int alignment = 1;
    linkable holders;  // list head of the autopointers referring to this block
    memorymanager* owner = nullptr;  // null once the pool has let go of the block

    allocatedmemory() { holders.init_head(); }

    unsigned char* endadr() const { return address + length; }
    // Moves the contents to `to` (overlapping moves allowed) and tells every holder.
    void relocate(unsigned char* to);
    // Shrinks the block in place; growing throws IllegalArgumentException.
    void resize(int newlength);
    // Drops the contents: address null, length 0, holders see null. The block
    // keeps its holders.
    void invalidate();
    // Unlinks the block from its pool and deletes it (after its last holder went).
    void deallocate();

    // The address every holder caches; also used when the pool buffer moves.
    void set_address(unsigned char* to);

    static allocatedmemory* from_link(linkable* l) { return reinterpret_cast<allocatedmemory*>(l); }

    // Sum of the lengths of all live blocks in all pools.
    static std::atomic<int> allocated_size;

private:
    allocatedmemory(const allocatedmemory&) = delete;
    allocatedmemory& operator=(const allocatedmemory&) = delete;
};

// A counted reference to a block; caches the block's current address.
class allocatedmemory_autopointer {
public:
    allocatedmemory_autopointer() {}
    explicit allocatedmemory_autopointer(allocatedmemory* block) { attach(block); }
    allocatedmemory_autopointer(const allocatedmemory_autopointer& o) { attach(o.block); }
    allocatedmemory_autopointer& operator=(const allocatedmemory_autopointer& o) {
        if (this != &o && block != o.block) {
            release();
            attach(o.block);
        }
        return *this;
    }
    ~allocatedmemory_autopointer() { release(); }

    // Shrinks the block (see allocatedmemory::resize); an empty holder throws
    // NullPointerException.
    void resize(unsigned int newlength);

    unsigned char* get() const { return address; }
    allocatedmemory* get_block() const { return block; }
    // Length of the block in bytes (0 for an empty holder).
    int length() const { return block ? block->length : 0; }
    bool isnull() const { return block == nullptr; }
    // Drops the reference (the block goes with its last holder).
    void reset() { release(); }

    static allocatedmemory_autopointer* from_link(linkable* l) {
        return reinterpret_cast<allocatedmemory_autopointer*>(l);
    }

    linkable link;  // membership in the block's holder list (first member)
    unsigned char* address = nullptr;
    allocatedmemory* block = nullptr;

private:
    void attach(allocatedmemory* b);
    void release();
};

class memorymanager {
public:
    // Bytes allocated beyond the usable capacity and never handed out.
    static constexpr unsigned int kTail = 204800;
    // Largest usable capacity: the buffer size and every offset fit a signed 32-bit int.
    static constexpr unsigned int kMaxCapacity = 0x7FFFFFFFu - kTail;
    // A pool whose free tail is below this after a collection grows at once.
    static constexpr unsigned int kLowWater = 307200;

    // Throws IllegalArgumentException for a capacity beyond kMaxCapacity and
    // RuntimeException when the buffer cannot be allocated.
    explicit memorymanager(unsigned int capacity);
    virtual ~memorymanager();

    allocatedmemory_autopointer allocate(unsigned int size);
    // alignment: a power of two up to 128; values below 8 count as 8.
    allocatedmemory_autopointer allocate(unsigned int size, unsigned int alignment);

    unsigned char* findspace(unsigned int size, unsigned int alignment);
    unsigned char* findspace(unsigned int size, unsigned int alignment, bool maycollect);

    virtual void garbagecollect() {}
    virtual void monitor_enter() {}
    virtual void monitor_exit() {}
    // Compacts all blocks towards the start; returns the first free address.
    virtual unsigned char* defragment();

    // Grows the capacity by 10 % (at least 8 bytes); OutOfMemory "native(MPR: %d)"
    // when that fails or would pass kMaxCapacity. The pool is unchanged then.
    void resizepool();

    // Free bytes after the newest block (holes are not counted).
    unsigned int get_free_space() const;
    // The process-wide total of live block lengths.
    int get_size() const;
    // Empties every block, lets go of them and frees the buffer; allocating
    // afterwards throws IllegalStateException.
    void release_resources();

    unsigned int get_capacity() const { return capacity; }
    unsigned char* get_base() const { return base; }
    // Number of blocks in the pool.
    int block_count() const;

    unsigned int capacity;
    unsigned char* base;
    linkable blocks;  // head: next is the newest block, prev the oldest

protected:
    // Moves the buffer to a larger one, keeping `oldsize` bytes; returns null on
    // failure and leaves the old buffer intact.
    virtual unsigned char* grow_buffer(unsigned char* old, unsigned int oldsize, unsigned int newsize);

private:
    allocatedmemory* newest() const { return allocatedmemory::from_link(blocks.next); }
    allocatedmemory* oldest() const { return allocatedmemory::from_link(blocks.prev); }

    memorymanager(const memorymanager&) = delete;
    memorymanager& operator=(const memorymanager&) = delete;
};
