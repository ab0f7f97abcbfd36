// The three calls back into Java that the engine makes, behind one small
// interface so that the engine builds and is tested without a JVM. The JNI
// layer implements it on the toolkit's Java peer ("SA", "h", "WA"); tests
// replace it.
#pragma once

class toolkit_callbacks {
public:
    virtual ~toolkit_callbacks() {}
    // Ask Java to upload texture `id`; true only if it did so during the call.
    virtual bool request_texture(unsigned short id) = 0;
    // Ask Java to collect garbage (a memory pool is short of space).
    virtual void garbagecollect() = 0;
    // Ask Java for a new, unbound shadow peer; returns the peer as an opaque
    // handle (a local reference in the JNI implementation) or null.
    virtual void* createshadow() = 0;
};
