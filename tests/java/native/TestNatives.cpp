// Natives used only by the JVM tests (class TestNatives), to drive the Java
// bridge pieces that no product entry exercises on its own: every exception
// kind, zero results, peer binding of every class, the array wrappers, and a
// view of the toolkit state behind a product toolkit's native id. Built into
// libpavoqen_testnatives.so, never into the product library.
#include <fcntl.h>
#include <jni.h>
#include <unistd.h>

#include <cstdio>
#include <stdexcept>
#include <string>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/objconvert.h"
#include "render/toolkit.h"

namespace {

// Kinds as numbered by TestNatives.java.
[[noreturn]] void throw_kind(int kind, const char* msg) {
    switch (kind) {
        case 0: throw new Exception(msg);
        case 1: throw new RuntimeException(msg);
        case 2: throw new ClassCastException(msg);
        case 3: throw new NullPointerException(msg);
        case 4: throw new OutOfMemory(msg);
        case 5: throw new IllegalArgumentException(msg);
        case 6: throw new IllegalStateException(msg);
        case 7: throw new NumberFormatException(msg);
        case 8: throw new ArrayIndexOutOfBoundsException(5, 3);
        case 9: throw new NativeError(msg);
        case 10: throw std::runtime_error(msg);
        default: throw kind;  // not even a std::exception
    }
}

std::string utf(JNIEnv* env, jstring s) {
    if (!s) return std::string();
    const char* c = env->GetStringUTFChars(s, nullptr);
    if (!c) return std::string();
    std::string out(c);
    env->ReleaseStringUTFChars(s, c);
    return out;
}

jint g_last_int = -1;
jboolean g_last_boolean = JNI_TRUE;
bool g_last_array_null = false;
bool g_last_object_null = false;
int g_pins_inside = -1;

int g_saved_stdout = -1;
std::string g_capture_path;

void set_peer(JNIEnv* env, int cls, jobject peer, void* p) {
    using namespace objconvert;
    switch (cls) {
        case 0: set_toolkit(env, peer, static_cast<toolkit*>(p)); break;
        case 1: set_memorypool(env, peer, static_cast<memorymanager*>(p)); break;
        case 2: set_model(env, peer, static_cast<model*>(p)); break;
        case 3: set_sprite(env, peer, static_cast<Sprite_c*>(p)); break;
        case 4: set_depthbuffer(env, peer, static_cast<DepthBuffer_c*>(p)); break;
        case 5: set_clippingmask(env, peer, static_cast<clippingmask*>(p)); break;
        case 6: set_ground(env, peer, static_cast<ground*>(p)); break;
        case 7: set_font_mono(env, peer, static_cast<font_mono*>(p)); break;
        case 8: set_font_paletted(env, peer, static_cast<font_paletted*>(p)); break;
        case 9: set_font_alpha(env, peer, static_cast<font_alpha*>(p)); break;
        case 10: set_shadow(env, peer, static_cast<shadow*>(p)); break;
        case 11: set_threadresource(env, peer, static_cast<threadresource*>(p)); break;
        case 12: set_canvas(env, peer, static_cast<canvas*>(p)); break;
        default: throw new IllegalArgumentException("binding kind");
    }
}

void* get_peer(JNIEnv* env, int cls, jobject peer) {
    using namespace objconvert;
    switch (cls) {
        case 0: return get_toolkit(env, peer);
        case 1: return get_memorypool(env, peer);
        case 2: return get_model(env, peer);
        case 3: return get_sprite(env, peer);
        case 4: return get_depthbuffer(env, peer);
        case 5: return get_clippingmask(env, peer);
        case 6: return get_ground(env, peer);
        case 7: return get_font_mono(env, peer);
        case 8: return get_font_paletted(env, peer);
        case 9: return get_font_alpha(env, peer);
        case 10: return get_shadow(env, peer);
        case 11: return get_threadresource(env, peer);
        case 12: return get_canvas(env, peer);
        default: throw new IllegalArgumentException("binding kind");
    }
}

// Adds one to every element (toggles booleans) through the wrapper's pointer,
// whether or not the wrapper is read-only.
template <class W>
jint bump(W& w) {
    for (jsize i = 0; i < w.length; ++i) w.elements[i] = decltype(+w.elements[i])(w.elements[i] + 1);
    return w.length;
}
template <class W>
jint toggle(W& w) {
    for (jsize i = 0; i < w.length; ++i) w.elements[i] = w.elements[i] ? 0 : 1;
    return w.length;
}

}  // namespace

extern "C" {

// ---- exceptions and zero results ----------------------------------------------------

JNIEXPORT void JNICALL Java_TestNatives_raise(JNIEnv* env, jclass, jint kind, jstring message) {
    guarded(env, [&] {
        std::string m = utf(env, message);
        throw_kind(kind, m.c_str());
    });
}

JNIEXPORT jint JNICALL Java_TestNatives_intResult(JNIEnv* env, jclass, jint kind) {
    g_last_int = guarded(env, [&]() -> jint {
        if (kind >= 0) throw_kind(kind, "int result");
        return 42;
    });
    return g_last_int;
}

JNIEXPORT jboolean JNICALL Java_TestNatives_booleanResult(JNIEnv* env, jclass, jint kind) {
    g_last_boolean = guarded(env, [&]() -> jboolean {
        if (kind >= 0) throw_kind(kind, "boolean result");
        return JNI_TRUE;
    });
    return g_last_boolean;
}

JNIEXPORT jintArray JNICALL Java_TestNatives_arrayResult(JNIEnv* env, jclass, jint kind) {
    jintArray r = guarded(env, [&]() -> jintArray {
        jintArray a = env->NewIntArray(3);  // made before the failure, as result arrays are
        if (!a) throw new OutOfMemory("result");
        if (kind >= 0) throw_kind(kind, "array result");
        return a;
    });
    g_last_array_null = r == nullptr;
    return r;
}

JNIEXPORT jobject JNICALL Java_TestNatives_objectResult(JNIEnv* env, jclass, jobject peer, jint kind) {
    jobject r = guarded(env, [&]() -> jobject {
        if (kind >= 0) throw_kind(kind, "object result");
        return peer;
    });
    g_last_object_null = r == nullptr;
    return r;
}

JNIEXPORT jint JNICALL Java_TestNatives_lastInt(JNIEnv*, jclass) { return g_last_int; }
JNIEXPORT jboolean JNICALL Java_TestNatives_lastBoolean(JNIEnv*, jclass) { return g_last_boolean; }
JNIEXPORT jboolean JNICALL Java_TestNatives_lastArrayWasNull(JNIEnv*, jclass) { return g_last_array_null; }
JNIEXPORT jboolean JNICALL Java_TestNatives_lastObjectWasNull(JNIEnv*, jclass) { return g_last_object_null; }

// ---- standard output capture ---------------------------------------------------------

JNIEXPORT void JNICALL Java_TestNatives_captureStdout(JNIEnv* env, jclass) {
    guarded(env, [&] {
        if (g_saved_stdout >= 0) throw new IllegalStateException("already capturing");
        char path[] = "/tmp/pavoqen_stdout_XXXXXX";
        int fd = mkstemp(path);
        if (fd < 0) throw new RuntimeException("mkstemp");
        std::fflush(stdout);
        g_saved_stdout = dup(1);
        dup2(fd, 1);
        close(fd);
        g_capture_path = path;
    });
}

JNIEXPORT jstring JNICALL Java_TestNatives_endCapture(JNIEnv* env, jclass) {
    return guarded(env, [&]() -> jstring {
        if (g_saved_stdout < 0) throw new IllegalStateException("not capturing");
        std::fflush(stdout);
        dup2(g_saved_stdout, 1);
        close(g_saved_stdout);
        g_saved_stdout = -1;
        std::string text;
        if (FILE* f = std::fopen(g_capture_path.c_str(), "rb")) {
            char buf[4096];
            size_t n;
            while ((n = std::fread(buf, 1, sizeof buf, f)) > 0) text.append(buf, n);
            std::fclose(f);
        }
        unlink(g_capture_path.c_str());
        return env->NewStringUTF(text.c_str());
    });
}

// ---- peer binding -----------------------------------------------------------------------

JNIEXPORT void JNICALL Java_TestNatives_bind(JNIEnv* env, jclass, jint cls, jobject peer, jlong address) {
    guarded(env, [&] { set_peer(env, cls, peer, from_id<void>(address)); });
}

JNIEXPORT jlong JNICALL Java_TestNatives_lookup(JNIEnv* env, jclass, jint cls, jobject peer) {
    return guarded(env, [&]() -> jlong {
        return static_cast<jlong>(reinterpret_cast<intptr_t>(get_peer(env, cls, peer)));
    });
}

// ---- array wrappers -------------------------------------------------------------------

#define COPIED(Name, T, A)                                                                       \
    JNIEXPORT jint JNICALL Java_TestNatives_##Name(JNIEnv* env, jclass, A a, jboolean readOnly) { \
        return guarded(env, [&]() -> jint {                                                      \
            if (readOnly) {                                                                      \
                copiedjniarray<T, A, true> w(env, a);                                            \
                return bump(w);                                                                  \
            }                                                                                    \
            copiedjniarray<T, A, false> w(env, a);                                               \
            return bump(w);                                                                      \
        });                                                                                      \
    }
COPIED(copiedInts, int, jintArray)
COPIED(copiedBytes, signed char, jbyteArray)
COPIED(copiedFloats, float, jfloatArray)
#undef COPIED

JNIEXPORT jint JNICALL Java_TestNatives_copiedBooleans(JNIEnv* env, jclass, jbooleanArray a, jboolean readOnly) {
    return guarded(env, [&]() -> jint {
        if (readOnly) {
            copiedjniarray<unsigned char, jbooleanArray, true> w(env, a);
            return toggle(w);
        }
        copiedjniarray<unsigned char, jbooleanArray, false> w(env, a);
        return toggle(w);
    });
}

#define PINNED(Name, T, A)                                                                       \
    JNIEXPORT jint JNICALL Java_TestNatives_##Name(JNIEnv* env, jclass, A a, jboolean readOnly) { \
        return guarded(env, [&]() -> jint {                                                      \
            if (readOnly) {                                                                      \
                pinnedjniarray<T, A, true> w(env, a);                                            \
                return bump(w);                                                                  \
            }                                                                                    \
            pinnedjniarray<T, A, false> w(env, a);                                               \
            return bump(w);                                                                      \
        });                                                                                      \
    }
PINNED(pinnedInts, int, jintArray)
#undef PINNED

JNIEXPORT jint JNICALL Java_TestNatives_pinnedBooleans(JNIEnv* env, jclass, jbooleanArray a, jboolean readOnly) {
    return guarded(env, [&]() -> jint {
        if (readOnly) {
            pinnedjniarray<unsigned char, jbooleanArray, true> w(env, a);
            return toggle(w);
        }
        pinnedjniarray<unsigned char, jbooleanArray, false> w(env, a);
        return toggle(w);
    });
}

// Pins `a` read-write, writes 99 into element 0, then fails with `kind`.
JNIEXPORT void JNICALL Java_TestNatives_pinThenRaise(JNIEnv* env, jclass, jintArray a, jint kind) {
    guarded(env, [&] {
        pinnedjniarray<int, jintArray, false> w(env, a);
        w.need(1);
        w[0] = 99;
        g_pins_inside = pin_count();
        throw_kind(kind, "while pinned");
    });
}

// Same with a copied read-write array.
JNIEXPORT void JNICALL Java_TestNatives_copyThenRaise(JNIEnv* env, jclass, jintArray a, jint kind) {
    guarded(env, [&] {
        copiedjniarray<int, jintArray, false> w(env, a);
        w.need(1);
        w[0] = 99;
        throw_kind(kind, "while copied");
    });
}

// Two arrays pinned together: both lengths are read and checked (n elements
// each) before either is pinned; then every element is incremented.
JNIEXPORT void JNICALL Java_TestNatives_pinTwo(JNIEnv* env, jclass, jintArray a, jfloatArray b, jint n) {
    g_pins_inside = -1;
    guarded(env, [&] {
        pinnedjniarray<int, jintArray, false> x(env, a, defer_pin);
        pinnedjniarray<float, jfloatArray, false> y(env, b, defer_pin);
        x.need(n);
        y.need(n);
        pin_all(x, y);
        pin_all(x, y);  // pinning again does nothing
        g_pins_inside = pin_count();
        bump(x);
        bump(y);
    });
}

JNIEXPORT jint JNICALL Java_TestNatives_pinsInside(JNIEnv*, jclass) { return g_pins_inside; }
JNIEXPORT jint JNICALL Java_TestNatives_pinCount(JNIEnv*, jclass) { return pin_count(); }

// {length, elements == null, change of the pin count} for a pinned null array.
JNIEXPORT jintArray JNICALL Java_TestNatives_pinnedNull(JNIEnv* env, jclass) {
    return guarded(env, [&]() -> jintArray {
        jintArray out = env->NewIntArray(3);
        if (!out) throw new OutOfMemory("result");
        jint r[3];
        {
            int before = pin_count();
            pinnedjniarray<float, jfloatArray, true> w(env, nullptr);
            r[0] = w.length;
            r[1] = w.data() == nullptr;
            r[2] = pin_count() - before;
        }
        env->SetIntArrayRegion(out, 0, 3, r);
        return out;
    });
}

// need(n) / need_range(offset, n) on a pinned int array.
JNIEXPORT void JNICALL Java_TestNatives_need(JNIEnv* env, jclass, jintArray a, jint n) {
    guarded(env, [&] {
        pinnedjniarray<int, jintArray, true> w(env, a);
        w.need(n);
    });
}

JNIEXPORT void JNICALL Java_TestNatives_needRange(JNIEnv* env, jclass, jintArray a, jint offset, jint n) {
    guarded(env, [&] {
        copiedjniarray<int, jintArray, true> w(env, a);
        w.need_range(offset, n);
    });
}

// ---- toolkit state behind a product toolkit's native id ----------------------------------
// Both libraries are built from the same toolkit declaration, so its fields
// can be read from here.

static toolkit& toolkit_at(jlong id) { return *from_id_checked<toolkit>(id); }

// camera, projection, viewprojection: 48 floats, row by row.
JNIEXPORT jfloatArray JNICALL Java_TestNatives_matrices(JNIEnv* env, jclass, jlong id) {
    return guarded(env, [&]() -> jfloatArray {
        toolkit& t = toolkit_at(id);
        float m[48];
        t.m_Camera.Get(m);
        t.m_Projection.Get(m + 16);
        t.m_ViewProjection.Get(m + 32);
        jfloatArray out = env->NewFloatArray(48);
        if (!out) throw new OutOfMemory("result");
        env->SetFloatArrayRegion(out, 0, 48, m);
        return out;
    });
}

// count, then x, y, z, scale for each of the four lights: 17 floats.
JNIEXPORT jfloatArray JNICALL Java_TestNatives_pointLights(JNIEnv* env, jclass, jlong id) {
    return guarded(env, [&]() -> jfloatArray {
        toolkit& t = toolkit_at(id);
        float v[17];
        v[0] = float(t.m_PointLightCount);
        for (int i = 0; i < 4; ++i) {
            alignas(16) float p[4];
            _mm_store_ps(p, t.m_PointLightPositions[i]);
            v[1 + 4 * i] = p[0];
            v[2 + 4 * i] = p[1];
            v[3 + 4 * i] = p[2];
            v[4 + 4 * i] = t.m_PointLightScales[i];
        }
        jfloatArray out = env->NewFloatArray(17);
        if (!out) throw new OutOfMemory("result");
        env->SetFloatArrayRegion(out, 0, 17, v);
        return out;
    });
}

JNIEXPORT jintArray JNICALL Java_TestNatives_pointLightColours(JNIEnv* env, jclass, jlong id) {
    return guarded(env, [&]() -> jintArray {
        toolkit& t = toolkit_at(id);
        jint c[4];
        for (int i = 0; i < 4; ++i) c[i] = jint(t.m_PointLightColours[i]);
        jintArray out = env->NewIntArray(4);
        if (!out) throw new OutOfMemory("result");
        env->SetIntArrayRegion(out, 0, 4, c);
        return out;
    });
}

}  // extern "C"
