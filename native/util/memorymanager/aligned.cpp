#include "util/memorymanager/aligned.h"

#include <cstdlib>
#include <cstring>

#include "jni/Exception.h"

// Sizes are rounded up to whole 16-byte groups: the vector code of the
// rasteriser and blitters loads and stores aligned groups of four pixels, and
// the last group of a buffer must lie inside its allocation.
static unsigned int whole_groups(unsigned int size) { return size > 0xFFFFFFF0u ? size : (size + 15u) & ~15u; }

void* _aligned_malloc(unsigned int size, unsigned int alignment) {
    if (alignment < 8) alignment = 8;
    size = whole_groups(size);
    void* p = nullptr;
    int err = posix_memalign(&p, alignment, size ? size : 1);
    if (err != 0) throw new RuntimeException(strerror(err));
    return p;
}

void* _aligned_realloc(void* p, unsigned int oldsize, unsigned int size, unsigned int alignment) {
    if (alignment < 8) alignment = 8;
    void* q = nullptr;
    if (posix_memalign(&q, alignment, whole_groups(size) ? whole_groups(size) : 1) != 0) return nullptr;
    if (p) {
        std::memcpy(q, p, oldsize < size ? oldsize : size);
        std::free(p);
    }
    return q;
}

void _aligned_free(void* p) { std::free(p); }
