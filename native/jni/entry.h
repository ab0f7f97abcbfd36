// The one wrapper that every exported entry goes through.
//
//   extern "C" JNIEXPORT jint JNICALL Java_x_y(JNIEnv* env, jobject self) {
//       return guarded(env, [&] { ... return value; });
//   }
//
// Scoped objects created inside the body (copied and pinned arrays, pool
// references) are destroyed while the exception unwinds out of the body, so a
// pinned array has left its critical region before the handler calls the JNI.
// A native Exception* becomes its Java exception; anything else becomes a
// RuntimeException "System exception occured". Failures return the zero value
// of the result type.
//
// The renderer runs with flush-to-zero and denormals-are-zero set. Those bits
// are set for the duration of each entry only and the caller's SSE control
// word is restored on the way out: the JVM's own float code on the same thread
// needs IEEE gradual underflow.
#pragma once

#include <jni.h>
#include <xmmintrin.h>

#include <cstdint>
#include <type_traits>

#include "jni/Exception.h"

namespace entry_detail {
void raise_system_exception(JNIEnv* env);

constexpr unsigned int kFlushDenormals = 0x8040;  // FTZ | DAZ

class fp_mode_scope {
public:
    fp_mode_scope() : m_Saved(_mm_getcsr()) { _mm_setcsr(m_Saved | kFlushDenormals); }
    ~fp_mode_scope() { _mm_setcsr(m_Saved); }
    fp_mode_scope(const fp_mode_scope&) = delete;
    fp_mode_scope& operator=(const fp_mode_scope&) = delete;

private:
    unsigned int m_Saved;
};
}  // namespace entry_detail

template <class F>
auto guarded(JNIEnv* env, F&& body) -> decltype(body()) {
    using R = decltype(body());
    entry_detail::fp_mode_scope fp_mode;
    try {
        return body();
    } catch (Exception* e) {
        e->throwJavaException(env);
        delete e;
    } catch (...) {
        entry_detail::raise_system_exception(env);
    }
    if constexpr (std::is_void_v<R>)
        return;
    else
        return R{};
}

// A native object passed from Java as its "nativeid" value. On i386 only the
// low 32 bits carry the address.
template <class T>
inline T* from_id(jlong id) {
    return reinterpret_cast<T*>(static_cast<intptr_t>(id));
}

// Same, but a zero id throws NullPointerException.
template <class T>
inline T* from_id_checked(jlong id) {
    T* p = from_id<T>(id);
    if (!p) throw new NullPointerException();
    return p;
}

inline bool jtrue(jboolean b) { return b == 1; }
