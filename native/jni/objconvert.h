// Binding of native objects to their Java peers through the peer's long field
// "nativeid". The address is stored sign-extended; on i386 only the low 32 bits
// are read back.
#pragma once

#include <jni.h>

#include <cstdint>

#include "jni/Exception.h"

class toolkit;
class memorymanager;
class model;
class Sprite_c;
class DepthBuffer_c;
class clippingmask;
class ground;
class font_mono;
class font_paletted;
class font_alpha;
class shadow;
class threadresource;
class canvas;

namespace objconvert {

// One class reference and field id per bound peer class, looked up by the
// first set_X of that class.
struct binding {
    jclass cls = nullptr;
    jfieldID nativeid = nullptr;
};

void set_address(binding& b, JNIEnv* env, jobject peer, void* native);
void* get_address(binding& b, JNIEnv* env, jobject peer);

#define PAVOQEN_BINDING(X, T)                                                   \
    extern binding X##_binding;                                                 \
    inline void set_##X(JNIEnv* env, jobject peer, T* native) {                 \
        set_address(X##_binding, env, peer, native);                            \
    }                                                                           \
    inline T* get_##X(JNIEnv* env, jobject peer) {                              \
        return static_cast<T*>(get_address(X##_binding, env, peer));            \
    }

PAVOQEN_BINDING(toolkit, toolkit)
PAVOQEN_BINDING(memorypool, memorymanager)
PAVOQEN_BINDING(model, model)
PAVOQEN_BINDING(sprite, Sprite_c)
PAVOQEN_BINDING(depthbuffer, DepthBuffer_c)
PAVOQEN_BINDING(clippingmask, clippingmask)
PAVOQEN_BINDING(ground, ground)
PAVOQEN_BINDING(font_mono, font_mono)
PAVOQEN_BINDING(font_paletted, font_paletted)
PAVOQEN_BINDING(font_alpha, font_alpha)
PAVOQEN_BINDING(shadow, shadow)
PAVOQEN_BINDING(threadresource, threadresource)
PAVOQEN_BINDING(canvas, canvas)
#undef PAVOQEN_BINDING

}  // namespace objconvert
