// Typed views of relocatable pool blocks.
//
// sharedarray<T> is a counted reference to a block of a pool, seen as an array
// of T. Copies share the elements; the last copy to go frees the block. The
// element pointer follows the block when the pool moves it, so take data() or
// a reference through operator[] again after anything that may allocate in
// the same pool. Elements are not initialised: a new pool starts zeroed,
// reused pool memory keeps old bytes.
//
// sharedarray2d<T> is a jagged two-dimensional array: one {start, count} entry
// per row and one element array.
#pragma once

#include <type_traits>

#include "jni/Exception.h"
#include "util/memorymanager/memorymanager.h"

// Alignment asked of the pool for elements of T (the pool raises anything below
// 8 to 8). Elements whose size is a multiple of 16 bytes are loaded as SSE
// vectors and get 16.
template <class T>
struct pool_alignment {
    static const unsigned int value = (sizeof(T) % 16 == 0) ? 16u : unsigned(alignof(T));
};

template <class T>
class sharedarray : public allocatedmemory_autopointer {
    static_assert(std::is_trivially_copyable<T>::value, "pool blocks are moved with memmove");

public:
    sharedarray() {}
    // Allocates `count` elements in `pool` (may collect, compact or grow it;
    // OutOfMemory when it cannot grow). A null pool throws NullPointerException.
    sharedarray(memorymanager* p, unsigned int count) {
        if (!p) throw new NullPointerException();
        unsigned long long bytes = (unsigned long long)count * sizeof(T);
        if (bytes > memorymanager::kMaxCapacity) throw new IllegalArgumentException("array too large for a memory pool");
        allocatedmemory_autopointer::operator=(p->allocate(unsigned(bytes), pool_alignment<T>::value));
        pool = p;
    }

    T* data() const { return reinterpret_cast<T*>(address); }
    // Element count (0 for an empty array).
    int count() const { return block ? block->length / int(sizeof(T)) : 0; }
    int size() const { return count(); }
    bool empty() const { return count() == 0; }
    memorymanager* get_pool() const { return pool; }

    T& operator[](int i) const { return data()[i]; }
    // Checked access: an array without a block throws NullPointerException, an
    // index outside 0..count-1 ArrayIndexOutOfBoundsException(index, count).
    T& at(int i) const {
        if (!block) throw new NullPointerException();
        int n = count();
        if ((unsigned int)i >= (unsigned int)n) throw new ArrayIndexOutOfBoundsException(i, n);
        return data()[i];
    }
    T* begin() const { return data(); }
    T* end() const { return data() + count(); }

    // Shrinks the array in place to `newcount` elements (never grows).
    void shrink(unsigned int newcount) {
        if (newcount > 0x7FFFFFFFu / sizeof(T)) throw new IllegalArgumentException("newlength<=length");
        resize(newcount * unsigned(sizeof(T)));
    }
    // Drops the reference.
    void reset() {
        allocatedmemory_autopointer::reset();
        pool = nullptr;
    }

    memorymanager* pool = nullptr;
};

template <class T>
class sharedarray2d {
public:
    struct Map {
        unsigned int start;
        unsigned int count;
    };

    sharedarray2d() {}
    // rows entries; row r holds rowcounts[r] elements, rows laid out one after another.
    sharedarray2d(memorymanager* pool, const unsigned int* rowcounts, unsigned int rows) : map(pool, rows) {
        unsigned long long total = 0;
        for (unsigned int r = 0; r < rows; ++r) {
            map[int(r)].start = unsigned(total);
            map[int(r)].count = rowcounts[r];
            total += rowcounts[r];
            if (total * sizeof(T) > memorymanager::kMaxCapacity)
                throw new IllegalArgumentException("array too large for a memory pool");
        }
        elements = sharedarray<T>(pool, unsigned(total));
    }

    int rows() const { return map.count(); }
    // Checked row access.
    unsigned int row_count(int r) const { return map.at(r).count; }
    T* row(int r) const {
        const Map& m = map.at(r);
        return elements.data() + m.start;
    }

    sharedarray<Map> map;
    sharedarray<T> elements;
};
