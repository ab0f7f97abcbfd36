// Copying Java arrays into pool memory.
//
//   copied_jintArrayRO a(env, javaArray);
//   sharedarray<unsigned int> s = toSharedarray<unsigned int>(a, pool);
//
// A null Java array gives an empty sharedarray without touching the pool.
// Otherwise the pool gets a block of the array's length (it may call back into
// Java for a collection, which is allowed: copied arrays hold no critical
// section) and every element is converted by plain integer conversion
// (a Java short becomes the unsigned short with the same 16 bits).
#pragma once

#include "jni/jniarray.h"
#include "util/memorymanager/sharedarray.h"

template <class U, class T, class A, bool ReadOnly>
sharedarray<U> toSharedarray(const copiedjniarray<T, A, ReadOnly>& a, memorymanager* pool) {
    if (a.isnull()) return sharedarray<U>();
    int n = a.length;
    sharedarray<U> out(pool, unsigned(n));
    U* dst = out.data();
    const T* src = a.data();
    for (int i = 0; i < n; ++i) dst[i] = U(src[i]);
    return out;
}
