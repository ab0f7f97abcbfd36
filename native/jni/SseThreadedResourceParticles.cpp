// The particle entry of the thread resource peer (class "a").
#include <jni.h>

#include "jni/entry.h"
#include "jni/jniarray.h"
#include "jni/toolkit_access.h"
#include "render/threadresource.h"
#include "render/toolkit.h"

extern "C" {

// The arrays are taken as element copies, not pinned: drawing may ask Java for
// a missing texture ("SA"), and no JNI call may happen while an array is
// pinned.
JNIEXPORT void JNICALL Java_a_b(JNIEnv* env, jobject, jlong trid, jint, jintArray positions, jintArray colours,
                                jintArray sizes, jshortArray textures, jint count) {
    guarded(env, [&] {
        threadresource* tr = from_id_checked<threadresource>(trid);
        toolkit& t = tk();
        if (count < 1) return;
        copied_jintArrayRO pos(env, positions);
        copied_jintArrayRO col(env, colours);
        copied_jintArrayRO siz(env, sizes);
        copiedjniarray<short, jshortArray, true> tex(env, textures);
        pos.need(3LL * count);
        col.need(count);
        siz.need(count);
        tex.need(count);
        if (t.m_ColourBuffer && t.m_DepthBuffer)
            tr->render_particles<true, true>(pos.data(), col.data(), siz.data(), tex.data(), count);
        else if (t.m_ColourBuffer)
            tr->render_particles<true, false>(pos.data(), col.data(), siz.data(), tex.data(), count);
        else if (t.m_DepthBuffer)
            tr->render_particles<false, true>(pos.data(), col.data(), siz.data(), tex.data(), count);
    });
}

}  // extern "C"
