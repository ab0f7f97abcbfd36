#include "jni/Exception.h"

#include <jni.h>

#include <cstdio>
#include <cstring>

Exception::Exception() : m_Message(new char[1]) { m_Message[0] = 0; }

Exception::Exception(const char* text) {
    if (!text) text = "";
    size_t n = std::strlen(text);
    m_Message = new char[n + 1];
    std::memcpy(m_Message, text, n + 1);
}

Exception::~Exception() { delete[] m_Message; }

static void throwNew(JNIEnv* env, const char* cls, const char* message) {
    jclass c = env->FindClass(cls);
    if (c) env->ThrowNew(c, message);
}

void Exception::throwJavaException(JNIEnv* env) { throwNew(env, "java/lang/Exception", m_Message); }

#define SIMPLE_RAISE(Name, JavaClass)                                          \
    Name::~Name() {}                                                           \
    void Name::throwJavaException(JNIEnv* env) { throwNew(env, JavaClass, m_Message); }

SIMPLE_RAISE(RuntimeException, "java/lang/RuntimeException")
SIMPLE_RAISE(ClassCastException, "java/lang/ClassCastException")
SIMPLE_RAISE(OutOfMemory, "java/lang/OutOfMemoryError")
SIMPLE_RAISE(IllegalArgumentException, "java/lang/IllegalArgumentException")
SIMPLE_RAISE(IllegalStateException, "java/lang/IllegalStateException")
SIMPLE_RAISE(NumberFormatException, "java/lang/NumberFormatException")
#undef SIMPLE_RAISE

NullPointerException::~NullPointerException() {}
void NullPointerException::throwJavaException(JNIEnv* env) {
    throwNew(env, "java/lang/NullPointerException", "");
}

NativeError::~NativeError() {}
void NativeError::throwJavaException(JNIEnv* env) {
    std::fputs("Throwing: ", stdout);
    std::fputs(m_Message, stdout);
    std::fputs("\n", stdout);
    std::fflush(stdout);
    throwNew(env, "trelk3/graphics2/NativeError", m_Message);
}

ArrayIndexOutOfBoundsException::~ArrayIndexOutOfBoundsException() {}
void ArrayIndexOutOfBoundsException::throwJavaException(JNIEnv* env) {
    jclass c = env->FindClass("java/lang/ArrayIndexOutOfBoundsException");
    if (!c) return;
    jmethodID init = env->GetMethodID(c, "<init>", "(I)V");
    if (!init) return;
    jobject e = env->NewObject(c, init, (jint)index);
    if (e) env->Throw((jthrowable)e);
}
