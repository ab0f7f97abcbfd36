#include "jni/jni_toolkit_callbacks.h"

#include "jni/Exception.h"
#include "render/toolkit.h"

jni_toolkit_callbacks::jni_toolkit_callbacks(JNIEnv* env, jobject peer) {
    env->GetJavaVM(&m_VM);
    jclass cls = env->GetObjectClass(peer);
    m_RequestTexture = env->GetMethodID(cls, "SA", "(S)Z");
    m_GarbageCollect = env->GetMethodID(cls, "h", "()V");
    m_CreateShadow = env->GetMethodID(cls, "WA", "()Ljava/lang/Object;");
    env->DeleteLocalRef(cls);
    if (!m_RequestTexture || !m_GarbageCollect || !m_CreateShadow) {
        env->ExceptionClear();
        throw new RuntimeException("toolkit peer lacks SA, h or WA");
    }
    m_Peer = env->NewWeakGlobalRef(peer);
}

jni_toolkit_callbacks::~jni_toolkit_callbacks() {
    JNIEnv* env = get_env();
    if (env && m_Peer) env->DeleteWeakGlobalRef(m_Peer);
}

JNIEnv* jni_toolkit_callbacks::get_env() const {
    JNIEnv* env = nullptr;
    if (!m_VM || m_VM->GetEnv(reinterpret_cast<void**>(&env), JNI_VERSION_1_1) != JNI_OK) return nullptr;
    return env;
}

bool jni_toolkit_callbacks::request_texture(unsigned short id) {
    JNIEnv* env = get_env();
    if (!env) return false;
    jboolean provided = env->CallBooleanMethod(m_Peer, m_RequestTexture, (jshort)id);
    // A Java exception thrown by the callback stays pending for the caller of
    // the entry; the texture counts as not provided.
    if (env->ExceptionCheck()) return false;
    return provided == JNI_TRUE;
}

void jni_toolkit_callbacks::garbagecollect() {
    JNIEnv* env = get_env();
    if (!env) return;
    env->CallVoidMethod(m_Peer, m_GarbageCollect);
    env->ExceptionCheck();  // an exception stays pending for the caller of the entry
}

void* jni_toolkit_callbacks::createshadow() {
    JNIEnv* env = get_env();
    if (!env) return nullptr;
    jobject shadow = env->CallObjectMethod(m_Peer, m_CreateShadow);
    if (env->ExceptionCheck()) return nullptr;
    return shadow;
}

JNIEnv* toolkit_env() {
    toolkit* tk = toolkit::m_pInstance;
    if (!tk || !tk->m_Callbacks) return nullptr;
    auto* cb = dynamic_cast<jni_toolkit_callbacks*>(tk->m_Callbacks);
    return cb ? cb->get_env() : nullptr;
}

JavaVM* toolkit_vm() {
    toolkit* tk = toolkit::m_pInstance;
    if (!tk || !tk->m_Callbacks) return nullptr;
    auto* cb = dynamic_cast<jni_toolkit_callbacks*>(tk->m_Callbacks);
    return cb ? cb->vm() : nullptr;
}
