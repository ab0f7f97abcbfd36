// Entries of the offscreen frame buffer peer (class "o"): copies between an
// offscreen pair and the current target. All objects arrive as native ids.
#include <jni.h>

#include "jni/entry.h"
#include "render/DepthBuffer.h"
#include "render/OffscreenSurface.h"
#include "render/toolkit.h"
#include "sprite/Sprite.h"

namespace {

toolkit& toolkit_of(jlong id) {
    toolkit* t = from_id_checked<toolkit>(id);
    if (t != toolkit::m_pInstance) throw new IllegalArgumentException("not the current toolkit");
    return *t;
}

}  // namespace

extern "C" {

JNIEXPORT void JNICALL Java_o_BA(JNIEnv* env, jobject, jlong tkid, jlong sprite, jlong depthbuffer, jint srcX,
                                 jint srcY, jint w, jint h, jint dstX, jint dstY, jboolean colour, jboolean depth) {
    guarded(env, [&] {
        OffscreenSurface_c::BlitToFramebuffer(toolkit_of(tkid), from_id<Sprite_c>(sprite),
                                              from_id<DepthBuffer_c>(depthbuffer), srcX, srcY, w, h, dstX, dstY,
                                              jtrue(colour), jtrue(depth));
    });
}

JNIEXPORT void JNICALL Java_o_AA(JNIEnv* env, jobject, jlong tkid, jlong sprite, jlong depthbuffer, jint srcX,
                                 jint srcY, jint w, jint h, jint dstX, jint dstY, jboolean colour, jboolean depth) {
    guarded(env, [&] {
        OffscreenSurface_c::BlitFromFramebuffer(toolkit_of(tkid), from_id<Sprite_c>(sprite),
                                                from_id<DepthBuffer_c>(depthbuffer), srcX, srcY, w, h, dstX, dstY,
                                                jtrue(colour), jtrue(depth));
    });
}

}  // extern "C"
