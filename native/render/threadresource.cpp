#include "render/threadresource.h"

#include <cstring>
#include <new>

#include "jni/Exception.h"
#include "render/toolkit.h"
#include "util/memorymanager/aligned.h"

void threadresource::check_scratch(Scratch_e region, long long count) {
    const long long capacity = region == Scratch_Vertices ? MaxVertices : MaxMarks;
    if (count < 0 || count > capacity)
        throw new IllegalArgumentException(region == Scratch_Vertices ? "too many vertices for the thread scratch"
                                                                      : "vertex index too large for light sharing");
}

threadresource* threadresource::create(toolkit& tk, int first, int second) {
    void* mem = _aligned_malloc(sizeof(threadresource), 16);
    return new (mem) threadresource(tk, first, second);
}

void threadresource::destroy(threadresource* tr) {
    if (!tr) return;
    tr->~threadresource();
    _aligned_free(tr);
}

threadresource::threadresource(toolkit& tk, int first, int second)
    : m_Toolkit(&tk), m_Second(second), m_First(first), m_SharelightPass(1) {
    for (__m128& v : m_Vertices) v = _mm_setzero_ps();
    std::memset(m_MarksA, 0, sizeof m_MarksA);
    std::memset(m_MarksB, 0, sizeof m_MarksB);
    std::memset(m_RenderExtent, 0, sizeof m_RenderExtent);
    m_Link.unlink();
    tk.m_Threads.insert_after(m_Link);
}

threadresource::~threadresource() { m_Link.unlink(); }
