// Toolkit entry that makes a canvas the render target.
#include <jni.h>

#include "jni/entry.h"
#include "jni/objconvert.h"
#include "jni/toolkit_access.h"
#include "render/canvas.h"

extern "C" {

// Activates the canvas (clearing colour and depth); a destroyed canvas peer
// leaves the toolkit without a target.
JNIEXPORT void JNICALL Java_ja_PA(JNIEnv* env, jobject, jobject canvasPeer) {
    guarded(env, [&] {
        toolkit& t = tk();
        t.set_active_canvas(objconvert::get_canvas(env, canvasPeer));
    });
}

}  // extern "C"
