// Aligned heap allocation. _aligned_malloc never returns null: a failure
// throws RuntimeException with the system's error text.
#pragma once

void* _aligned_malloc(unsigned int size, unsigned int alignment);
// Grows or shrinks a block from _aligned_malloc keeping the requested
// alignment (allocate, copy, free). `oldsize` bytes are preserved (or `size`
// if smaller). Returns null on failure and leaves `p` untouched.
void* _aligned_realloc(void* p, unsigned int oldsize, unsigned int size, unsigned int alignment);
void _aligned_free(void* p);
