#include "render/memorypool.h"

#include "render/toolkit.h"

memorypool::memorypool(toolkit& tk, unsigned int capacity) : memorymanager(capacity), m_Toolkit(&tk) {}

memorypool::~memorypool() {}

void memorypool::garbagecollect() { m_Toolkit->garbagecollect(); }
