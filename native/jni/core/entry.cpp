#include "jni/entry.h"

namespace entry_detail {
void raise_system_exception(JNIEnv* env) {
    jclass c = env->FindClass("java/lang/RuntimeException");
    if (c) env->ThrowNew(c, "System exception occured");
}
}  // namespace entry_detail
