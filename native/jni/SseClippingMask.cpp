// Entries of the clipping-mask peer (class "wa").
#include <jni.h>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/objconvert.h"
#include "jni/sharedarray_jni.h"
#include "text/clippingmask.h"

extern "C" {

// Copies both arrays into the pool and binds the new mask; a mask bound
// before is destroyed once the new one is in place.
JNIEXPORT void JNICALL Java_wa_l(JNIEnv* env, jobject self, jobject, jobject poolpeer, jint width, jint height,
                                 jintArray starts, jintArray lengths) {
    guarded(env, [&] {
        memorymanager* pool = objconvert::get_memorypool(env, poolpeer);
        if (!pool) throw new NullPointerException();
        copied_jintArrayRO s(env, starts);
        copied_jintArrayRO l(env, lengths);
        if (l.length < s.length) throw new IllegalArgumentException("clipping mask has fewer lengths than starts");
        clippingmask* old = objconvert::get_clippingmask(env, self);
        clippingmask* mask = new clippingmask(width, height, toSharedarray<int>(s, pool), toSharedarray<int>(l, pool));
        try {
            objconvert::set_clippingmask(env, self, mask);
        } catch (...) {
            delete mask;
            throw;
        }
        delete old;
    });
}

JNIEXPORT void JNICALL Java_wa_ma(JNIEnv* env, jobject self) {
    guarded(env, [&] {
        clippingmask* mask = objconvert::get_clippingmask(env, self);
        objconvert::set_clippingmask(env, self, nullptr);
        delete mask;
    });
}

}  // extern "C"
