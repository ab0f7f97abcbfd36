// Toolkit entries for offscreen targets and pixel read-back and write.
#include <jni.h>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/toolkit_access.h"
#include "render/DepthBuffer.h"
#include "render/blitclip.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"

extern "C" {

JNIEXPORT void JNICALL Java_ja_d(JNIEnv* env, jobject, jlong sprite, jlong depthbuffer) {
    guarded(env, [&] { tk().start_offscreen_render(from_id<Sprite_c>(sprite), from_id<DepthBuffer_c>(depthbuffer)); });
}

JNIEXPORT jintArray JNICALL Java_ja_E(JNIEnv* env, jobject, jint x, jint y, jint w, jint h) {
    return guarded(env, [&]() -> jintArray {
        toolkit& t = tk();
        CheckImageSize(w, h);
        if (!t.m_ColourBuffer) throw new Exception("No colour buffer");
        jintArray result = env->NewIntArray(w * h);
        if (!result) return nullptr;  // OutOfMemoryError is pending
        {
            pinnedjniarray<int, jintArray, false> out(env, result);
            out.need((long long)w * h);
            t.getarea(x, y, w, h, out.data());
        }
        return result;
    });
}

JNIEXPORT void JNICALL Java_ja_BA(JNIEnv* env, jobject, jint x, jint y, jint w, jint h, jintArray pixels, jint offset,
                                  jint stride) {
    guarded(env, [&] {
        toolkit& t = tk();
        pinnedjniarray<int, jintArray, true> in(env, pixels);
        if (w <= 0 || h <= 0) return;
        in.need(1);
        CheckRectElements(w, h, offset, stride, in.length);
        t.setarea(x, y, w, h, in.data(), offset, stride);
    });
}

}  // extern "C"
