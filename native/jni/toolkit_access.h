// The current toolkit for an entry; entries that need one throw
// IllegalStateException when the toolkit peer has not been created.
#pragma once

#include "jni/Exception.h"
#include "render/toolkit.h"

inline toolkit& tk() {
    toolkit* t = toolkit::m_pInstance;
    if (!t) throw new IllegalStateException("no toolkit");
    return *t;
}
