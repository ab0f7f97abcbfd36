// Scoped access to Java arrays.
//
// copiedjniarray: the JNI's element copy (Get<Type>ArrayElements); read-only
// instances release with JNI_ABORT, read-write ones copy back.
// pinnedjniarray: critical, pinned access for large per-call arrays; no JNI call
// may be made while one is alive.
//
// The JNI environment is held per wrapper object, so arrays of one type can be
// used by several threads at once.
#pragma once

#include <jni.h>

#include <atomic>

#include "jni/Exception.h"

template <class T, class A>
struct jniarray_traits;

#define PAVOQEN_ARRAY_TRAITS(T, A, Name)                                                  \
    template <>                                                                           \
    struct jniarray_traits<T, A> {                                                        \
        static T* get(JNIEnv* env, A a, jboolean* c) {                                    \
            return reinterpret_cast<T*>(env->Get##Name##ArrayElements(a, c));             \
        }                                                                                 \
        static void release(JNIEnv* env, A a, T* e, jint mode) {                          \
            env->Release##Name##ArrayElements(a, reinterpret_cast<decltype(env->Get##Name##ArrayElements(a, nullptr))>(e), mode); \
        }                                                                                 \
    };
PAVOQEN_ARRAY_TRAITS(int, jintArray, Int)
PAVOQEN_ARRAY_TRAITS(short, jshortArray, Short)
PAVOQEN_ARRAY_TRAITS(signed char, jbyteArray, Byte)
PAVOQEN_ARRAY_TRAITS(unsigned char, jbooleanArray, Boolean)
PAVOQEN_ARRAY_TRAITS(float, jfloatArray, Float)
#undef PAVOQEN_ARRAY_TRAITS

// What copied and pinned arrays share: the Java array, its length, the element
// pointer and the checks. A null array where elements are needed throws
// NullPointerException; one shorter than needed throws
// ArrayIndexOutOfBoundsException(first missing index, length).
template <class T, class A>
struct jniarray_base {
    jniarray_base(JNIEnv* e, A a) : env(e), iscopy(JNI_FALSE), array(a), elements(nullptr), length(0) {}

    void need(long long n) const {
        if (n <= 0) return;
        if (!array) throw new NullPointerException();
        if (n > length) throw new ArrayIndexOutOfBoundsException(int(n > 0x7fffffff ? 0x7fffffff : n - 1), length);
    }
    void need_range(long long offset, long long n) const {
        if (n <= 0) return;
        if (!array) throw new NullPointerException();
        check_range(offset, n, length);
    }
    T& operator[](long long i) { return elements[i]; }
    const T& operator[](long long i) const { return elements[i]; }
    T* data() const { return elements; }
    bool isnull() const { return array == nullptr; }

    // The JVM failed to give the elements and raised OutOfMemoryError: replace
    // it by ours so that no JNI call is made with an exception pending.
    [[noreturn]] void elements_failed() {
        array = nullptr;
        length = 0;
        if (env->ExceptionCheck()) env->ExceptionClear();
        throw new OutOfMemory("array elements");
    }

    JNIEnv* env;
    jboolean iscopy;
    A array;
    T* elements;
    jsize length;

    jniarray_base(const jniarray_base&) = delete;
    jniarray_base& operator=(const jniarray_base&) = delete;
};

std::atomic<int>& pin_count_ref();

template <class T, class A, bool ReadOnly>
class copiedjniarray : public jniarray_base<T, A> {
    using base = jniarray_base<T, A>;

public:
    using base::array;
    using base::elements;
    using base::env;
    using base::iscopy;
    using base::length;

    copiedjniarray(JNIEnv* e, A a) : base(e, a) {
        if (array) {
            length = env->GetArrayLength(array);
            getElements();
            if (!elements) this->elements_failed();
        }
    }
    ~copiedjniarray() {
        if (array) releaseElements();
    }
    void getElements() { elements = jniarray_traits<T, A>::get(env, array, &iscopy); }
    void releaseElements() {
        jniarray_traits<T, A>::release(env, array, elements, ReadOnly ? JNI_ABORT : 0);
        array = nullptr;
        elements = nullptr;
    }
};

typedef copiedjniarray<int, jintArray, true> copied_jintArrayRO;

// Tag for a pinned array that is pinned later, by pin() or pin_all(). When one
// entry pins several arrays, every length must be read (a JNI call) before the
// first array is pinned:
//
//   pinnedjniarray<int, jintArray, true> a(env, ja, defer_pin);
//   pinnedjniarray<float, jfloatArray, true> b(env, jb, defer_pin);
//   a.need(n); b.need(m);      // checks before anything is pinned
//   pin_all(a, b);
//
// Copied arrays and result arrays are likewise created before the first pin.
struct defer_pin_t {};
constexpr defer_pin_t defer_pin{};

template <class T, class A, bool ReadOnly>
class pinnedjniarray : public jniarray_base<T, A> {
    using base = jniarray_base<T, A>;

public:
    using base::array;
    using base::elements;
    using base::env;
    using base::iscopy;
    using base::length;

    pinnedjniarray(JNIEnv* e, A a) : pinnedjniarray(e, a, defer_pin) { pin(); }
    // Reads the length only; elements stay null until pin().
    pinnedjniarray(JNIEnv* e, A a, defer_pin_t) : base(e, a) {
        if (array) length = env->GetArrayLength(array);
    }
    // Pins the array (nothing for a null array or one already pinned).
    void pin() {
        if (!array || elements) return;
        elements = static_cast<T*>(env->GetPrimitiveArrayCritical(array, &iscopy));
        if (!elements) this->elements_failed();
        ++pin_count_ref();
    }
    ~pinnedjniarray() {
        if (array && elements) {
            env->ReleasePrimitiveArrayCritical(array, elements, ReadOnly ? JNI_ABORT : 0);
            --pin_count_ref();
            array = nullptr;
            elements = nullptr;
        }
    }
};

// Pins deferred arrays in argument order.
template <class... P>
void pin_all(P&... arrays) {
    (arrays.pin(), ...);
}

// Current number of pinned arrays in the process.
int pin_count();
