// Entries of the depth buffer peer (class "oa").
#include <jni.h>

#include <memory>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "render/DepthBuffer.h"
#include "render/OffscreenSurface.h"
#include "render/blitclip.h"
#include "render/toolkit.h"

extern "C" {

JNIEXPORT void JNICALL Java_oa_g(JNIEnv* env, jobject self, jint width, jint height) {
    guarded(env, [&] {
        CheckImageSize(width, height);
        std::unique_ptr<DepthBuffer_c> d(new DepthBuffer_c);
        d->Allocate(unsigned(width), unsigned(height));
        objconvert::set_depthbuffer(env, self, d.get());
        d.release();
    });
}

JNIEXPORT void JNICALL Java_oa_za(JNIEnv* env, jobject self, jlong depthbuffer) {
    guarded(env, [&] {
        DepthBuffer_c* d = from_id<DepthBuffer_c>(depthbuffer);
        if (d) {
            if (toolkit::m_pInstance) OffscreenSurface_c::Forget(*toolkit::m_pInstance, nullptr, d);
            delete d;
        }
        objconvert::set_depthbuffer(env, self, nullptr);
    });
}

}  // extern "C"
