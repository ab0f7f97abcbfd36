// Test-only natives for the memory-pool and texture-cache JVM tests (class
// MemoryTexturesNatives): blocks allocated in the pool behind a Java pool
// peer, and texture fetches through the cache of a product toolkit, so that
// the pool's collection callback and the cache's texture request run from a
// real JVM.
#include <jni.h>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "render/toolkit.h"
#include "texture/texturecache.h"
#include "util/memorymanager/memorymanager.h"

namespace {

memorymanager& pool_of(JNIEnv* env, jobject peer) {
    memorymanager* pool = objconvert::get_memorypool(env, peer);
    if (!pool) throw new NullPointerException();
    return *pool;
}

unsigned char pattern(const allocatedmemory_autopointer* h, int i) {
    return (unsigned char)((reinterpret_cast<uintptr_t>(h) >> 4) + unsigned(i) * 13u);
}

}  // namespace

extern "C" {

// A new block of `size` bytes filled with a pattern; returns its holder.
JNIEXPORT jlong JNICALL Java_MemoryTexturesNatives_allocate(JNIEnv* env, jclass, jobject poolpeer, jint size) {
    return guarded(env, [&]() -> jlong {
        memorymanager& pool = pool_of(env, poolpeer);
        if (size < 0) throw new IllegalArgumentException("size");
        auto* h = new allocatedmemory_autopointer(pool.allocate(unsigned(size)));
        for (int i = 0; i < size; ++i) h->get()[i] = pattern(h, i);
        return jlong(reinterpret_cast<intptr_t>(h));
    });
}

// True when the holder still sees its own pattern at its block's address.
JNIEXPORT jboolean JNICALL Java_MemoryTexturesNatives_intact(JNIEnv* env, jclass, jlong holder) {
    return guarded(env, [&]() -> jboolean {
        auto* h = from_id_checked<allocatedmemory_autopointer>(holder);
        if (!h->get_block() || h->get() != h->get_block()->address) return JNI_FALSE;
        for (int i = 0; i < h->length(); ++i)
            if (h->get()[i] != pattern(h, i)) return JNI_FALSE;
        return JNI_TRUE;
    });
}

JNIEXPORT void JNICALL Java_MemoryTexturesNatives_release(JNIEnv* env, jclass, jlong holder) {
    guarded(env, [&] { delete from_id_checked<allocatedmemory_autopointer>(holder); });
}

JNIEXPORT jint JNICALL Java_MemoryTexturesNatives_capacity(JNIEnv* env, jclass, jobject poolpeer) {
    return guarded(env, [&] { return jint(pool_of(env, poolpeer).capacity); });
}

JNIEXPORT jlong JNICALL Java_MemoryTexturesNatives_toolkitPool(JNIEnv* env, jclass, jlong tk) {
    return guarded(env, [&] {
        return jlong(reinterpret_cast<intptr_t>(from_id_checked<toolkit>(tk)->m_MemoryPool));
    });
}

JNIEXPORT jlong JNICALL Java_MemoryTexturesNatives_poolAddress(JNIEnv* env, jclass, jobject poolpeer) {
    return guarded(env, [&] { return jlong(reinterpret_cast<intptr_t>(&pool_of(env, poolpeer))); });
}

// gettex through the toolkit: {texel (0,0), texel (127,127), average HSL of
// the slot's metrics, scroll offset u} or null when the cache returns none.
JNIEXPORT jintArray JNICALL Java_MemoryTexturesNatives_gettex(JNIEnv* env, jclass, jlong tk, jint id) {
    return guarded(env, [&]() -> jintArray {
        textureslot* s = from_id_checked<toolkit>(tk)->gettex((unsigned short)id);
        if (!s) return nullptr;
        jint v[4] = {jint(s->texels[0]), jint(s->texels[127 + 127 * texturecache::kStride]),
                     jint(s->metrics.averagehsl), jint(_mm_cvtss_f32(s->scrolloffsetu))};
        jintArray out = env->NewIntArray(4);
        if (out) env->SetIntArrayRegion(out, 0, 4, v);
        return out;
    });
}

// The metrics record of an id: {average HSL, transparency, wrapu, scrollu} or null.
JNIEXPORT jintArray JNICALL Java_MemoryTexturesNatives_metrics(JNIEnv* env, jclass, jlong tk, jint id) {
    return guarded(env, [&]() -> jintArray {
        texturemetrics* m = from_id_checked<toolkit>(tk)->getmetrics((unsigned short)id);
        if (!m) return nullptr;
        jint v[4] = {jint(m->averagehsl), jint(m->transparency), jint(m->wrapu), jint(m->scrollu)};
        jintArray out = env->NewIntArray(4);
        if (out) env->SetIntArrayRegion(out, 0, 4, v);
        return out;
    });
}

}  // extern "C"
