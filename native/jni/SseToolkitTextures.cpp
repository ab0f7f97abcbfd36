// Texture entries of the toolkit peer (class "ja"): texture and metrics
// uploads into the texture cache. The per-frame scroll update ("Y") is with
// the other toolkit entries.
#include <jni.h>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/toolkit_access.h"
#include "render/toolkit.h"
#include "texture/texturecache.h"

extern "C" {

JNIEXPORT void JNICALL Java_ja_F(JNIEnv* env, jobject, jint id, jintArray pixels, jint averagehsl, jint transparency,
                                 jint materialkind, jint field4, jint field5, jint field6, jint greyblend,
                                 jint brightness, jint scrollu, jint scrollv, jint omitted, jint dropfaces,
                                 jint field13, jint wrapu, jint wrapv, jint field16, jint field17, jint field18,
                                 jint field19) {
    guarded(env, [&] {
        toolkit& t = tk();
        texturemetrics m;
        m.set(averagehsl, transparency, materialkind, field4, field5, field6, greyblend, brightness, scrollu, scrollv,
              omitted, dropfaces, field13, wrapu, wrapv, field16, field17, field18, field19);
        // Only read: released without copying back.
        pinnedjniarray<int, jintArray, true> px(env, pixels);
        px.need(texturecache::kSize * texturecache::kSize);
        t.upload_texture((unsigned short)id, px.data(), m);
    });
}

JNIEXPORT void JNICALL Java_ja_V(JNIEnv* env, jobject, jint id, jint averagehsl, jint transparency,
                                 jint materialkind, jint field4, jint field5, jint field6, jint greyblend,
                                 jint brightness, jint scrollu, jint scrollv, jint omitted, jint dropfaces,
                                 jint field13, jint wrapu, jint wrapv, jint field16, jint field17, jint field18,
                                 jint field19) {
    guarded(env, [&] {
        toolkit& t = tk();
        texturemetrics m;
        m.set(averagehsl, transparency, materialkind, field4, field5, field6, greyblend, brightness, scrollu, scrollv,
              omitted, dropfaces, field13, wrapu, wrapv, field16, field17, field18, field19);
        t.upload_texturemetrics((unsigned short)id, m);
    });
}

}  // extern "C"
