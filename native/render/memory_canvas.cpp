#include "render/canvas.h"
#include "util/memorymanager/aligned.h"

memory_canvas::memory_canvas(int width, int height) {
    m_Width = width;
    m_Height = height;
    unsigned int n = unsigned(width) * unsigned(height) * 4u;
    m_ColourBuffer = static_cast<unsigned int*>(_aligned_malloc(n, 64));
    try {
        m_DepthBuffer = static_cast<float*>(_aligned_malloc(n, 64));
    } catch (...) {
        _aligned_free(m_ColourBuffer);
        throw;
    }
}

memory_canvas::~memory_canvas() {
    _aligned_free(m_ColourBuffer);
    _aligned_free(m_DepthBuffer);
}
