#include "jni/objconvert.h"

namespace objconvert {

binding toolkit_binding, memorypool_binding, model_binding, sprite_binding, depthbuffer_binding,
    clippingmask_binding, ground_binding, font_mono_binding, font_paletted_binding, font_alpha_binding,
    shadow_binding, threadresource_binding, canvas_binding;

static jfieldID field_of(binding& b, JNIEnv* env, jobject peer) {
    if (!b.nativeid) {
        jclass c = env->GetObjectClass(peer);
        b.cls = static_cast<jclass>(env->NewWeakGlobalRef(c));
        b.nativeid = env->GetFieldID(c, "nativeid", "J");
        env->DeleteLocalRef(c);
        if (!b.nativeid) {
            env->ExceptionClear();
            throw new RuntimeException("peer class has no long field nativeid");
        }
    }
    return b.nativeid;
}

void set_address(binding& b, JNIEnv* env, jobject peer, void* native) {
    if (!peer) throw new NullPointerException();
    jfieldID f = field_of(b, env, peer);
    env->SetLongField(peer, f, static_cast<jlong>(reinterpret_cast<intptr_t>(native)));
}

void* get_address(binding& b, JNIEnv* env, jobject peer) {
    if (!peer) throw new NullPointerException();
    jfieldID f = field_of(b, env, peer);
    return reinterpret_cast<void*>(static_cast<intptr_t>(env->GetLongField(peer, f)));
}

}  // namespace objconvert
