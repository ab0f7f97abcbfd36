// toolkit_callbacks on the Java toolkit peer: "SA" (S)Z, "h" ()V and
// "WA" ()Ljava/lang/Object;. Each call takes the calling thread's environment.
#pragma once

#include <jni.h>

#include "render/callbacks.h"

class jni_toolkit_callbacks : public toolkit_callbacks {
public:
    jni_toolkit_callbacks(JNIEnv* env, jobject peer);
    ~jni_toolkit_callbacks() override;
    bool request_texture(unsigned short id) override;
    void garbagecollect() override;
    void* createshadow() override;
    JNIEnv* get_env() const;
    JavaVM* vm() const { return m_VM; }

private:
    JavaVM* m_VM = nullptr;
    jobject m_Peer = nullptr;  // weak global reference
    jmethodID m_RequestTexture = nullptr;
    jmethodID m_GarbageCollect = nullptr;
    jmethodID m_CreateShadow = nullptr;
};

// The JNIEnv of the calling thread, from the toolkit's VM.
JNIEnv* toolkit_env();
JavaVM* toolkit_vm();
