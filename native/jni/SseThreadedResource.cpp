// Entries of the thread resource peer (class "a"): creation, destruction,
// thick lines and plain coloured triangles. The model, terrain and particle
// entries of this peer live beside their subsystems.
#include <jni.h>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/Rasterizer.h"
#include "render/threadresource.h"
#include "render/toolkit.h"

extern "C" {

JNIEXPORT void JNICALL Java_a_ha(JNIEnv* env, jobject self, jint, jint, jint, jint first, jint second) {
    guarded(env, [&] {
        threadresource* tr = threadresource::create(tk(), first, second);
        objconvert::set_threadresource(env, self, tr);
    });
}

JNIEXPORT void JNICALL Java_a_R(JNIEnv* env, jobject self, jlong id) {
    guarded(env, [&] {
        threadresource::destroy(from_id<threadresource>(id));
        objconvert::set_threadresource(env, self, nullptr);
    });
}

JNIEXPORT void JNICALL Java_a_JA(JNIEnv* env, jobject, jlong id) {
    guarded(env, [&] { from_id_checked<threadresource>(id)->linkthread(); });
}

JNIEXPORT void JNICALL Java_a_UA(JNIEnv* env, jobject, jlong id) {
    guarded(env, [&] { from_id_checked<threadresource>(id)->unlinkthread(); });
}

JNIEXPORT void JNICALL Java_a_K(JNIEnv* env, jobject, jlong id, jint, jint x1, jint y1, jint x2, jint y2,
                                jint colour, jint thickness, jint mode) {
    guarded(env, [&] {
        threadresource* tr = from_id_checked<threadresource>(id);
        tk().line_thick(*tr, x1, y1, x2, y2, unsigned(colour), thickness, unsigned(mode));
    });
}

JNIEXPORT void JNICALL Java_a_ra(JNIEnv* env, jobject, jlong, jint x1, jint y1, jint x2, jint y2, jint x3,
                                 jint y3, jint colour1, jint colour2, jint colour3) {
    guarded(env, [&] {
        Rasterizer_n::RenderColouredTriangle(x1, y1, x2, y2, x3, y3, unsigned(colour1), unsigned(colour2),
                                             unsigned(colour3));
    });
}

}  // extern "C"
