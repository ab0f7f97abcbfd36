// Entries of the memory-pool peer (class "ba") and the toolkit's pool entries
// ("ja": choosing the toolkit's pool, the allocation statistic).
#include <jni.h>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/memorypool.h"
#include "render/toolkit.h"

extern "C" {

JNIEXPORT void JNICALL Java_ba_sa(JNIEnv* env, jobject self, jint, jint capacity) {
    guarded(env, [&] {
        toolkit& t = tk();
        if (capacity < 0) throw new IllegalArgumentException("negative pool capacity");
        memorypool* pool = new memorypool(t, unsigned(capacity));
        try {
            objconvert::set_memorypool(env, self, pool);
        } catch (...) {
            delete pool;
            throw;
        }
    });
}

JNIEXPORT void JNICALL Java_ba_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        memorymanager* pool = objconvert::get_memorypool(env, self);
        if (pool) {
            toolkit* t = toolkit::m_pInstance;
            if (t && t->m_MemoryPool == pool) t->m_MemoryPool = nullptr;
            delete pool;
        }
        objconvert::set_memorypool(env, self, nullptr);
    });
}

JNIEXPORT void JNICALL Java_ba_ha(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        memorymanager* pool = objconvert::get_memorypool(env, self);
        if (!pool) throw new NullPointerException();
        pool->release_resources();
    });
}

JNIEXPORT void JNICALL Java_ba_u(JNIEnv*, jobject) {}

JNIEXPORT void JNICALL Java_ja_n(JNIEnv* env, jobject, jobject poolpeer) {
    guarded(env, [&] {
        toolkit& t = tk();
        t.m_MemoryPool = objconvert::get_memorypool(env, poolpeer);
    });
}

JNIEXPORT jint JNICALL Java_ja_za(JNIEnv*, jobject) { return allocatedmemory::allocated_size.load(); }

}  // extern "C"
