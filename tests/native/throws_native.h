// True when f throws a native exception of type E (the exception is freed).
#pragma once

#include "jni/Exception.h"

template <class E, class F>
bool throws_native(F&& f) {
    try {
        f();
    } catch (Exception* e) {
        bool ok = dynamic_cast<E*>(e) != nullptr;
        delete e;
        return ok;
    }
    return false;
}
