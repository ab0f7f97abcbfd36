// A fixed-size array on the aligned heap that owns its elements exclusively.
// Elements are value-initialised (0, null, or empty for sharedarray elements).
#pragma once

#include <new>

#include "jni/Exception.h"
#include "util/memorymanager/aligned.h"

template <class T>
class simplearray {
public:
    simplearray() {}
    explicit simplearray(unsigned int n) {
        unsigned long long bytes = (unsigned long long)n * sizeof(T);
        if (bytes > 0x7FFFFFFFull) throw new IllegalArgumentException("array too large");
        data = static_cast<T*>(_aligned_malloc(unsigned(bytes), alignof(T) < 4 ? 4u : unsigned(alignof(T))));
        for (unsigned int i = 0; i < n; ++i) new (data + i) T();
        count = int(n);
    }
    ~simplearray() {
        if (!data) return;
        for (int i = 0; i < count; ++i) data[i].~T();
        _aligned_free(data);
        data = nullptr;
        count = 0;
    }

    int size() const { return count; }
    T& operator[](int i) const { return data[i]; }
    // Checked access: ArrayIndexOutOfBoundsException(index, count) outside 0..count-1.
    T& at(int i) const {
        if ((unsigned int)i >= (unsigned int)count) throw new ArrayIndexOutOfBoundsException(i, count);
        return data[i];
    }
    T* begin() const { return data; }
    T* end() const { return data + count; }

    int count = 0;
    T* data = nullptr;

private:
    simplearray(const simplearray&) = delete;
    simplearray& operator=(const simplearray&) = delete;
};
