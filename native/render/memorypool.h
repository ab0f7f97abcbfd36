// The pool behind a Java memory-pool peer: before it grows it asks Java for a
// garbage collection through the toolkit (finalised peers release their
// blocks), then compacts, and grows only if still short of space.
#pragma once

#include "util/memorymanager/memorymanager.h"

class toolkit;

class memorypool : public memorymanager {
public:
    memorypool(toolkit& tk, unsigned int capacity);
    ~memorypool() override;

    void garbagecollect() override;

    toolkit* m_Toolkit;
};
