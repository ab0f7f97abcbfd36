#include "render/canvas.h"
#include "util/memorymanager/aligned.h"

memory_canvas::memory_canvas(int width, int height) {
    check_size(width, height);
    unsigned int n = unsigned(width) * unsigned(height) * 4u;
    m_ColourBuffer = static_cast<unsigned int*>(_aligned_malloc(n, 64));
    try {
        m_DepthBuffer = static_cast<float*>(_aligned_malloc(n, 64));
    } catch (...) {
        _aligned_free(m_ColourBuffer);
        throw;
    }
    m_Width = width;
    m_Height = height;
}

memory_canvas::~memory_canvas() {
    release_from_toolkit(m_Spare);
    _aligned_free(m_ColourBuffer);
    _aligned_free(m_Spare);
    _aligned_free(m_DepthBuffer);
}

void memory_canvas::swap_colourbuffer() {
    if (!m_Spare) m_Spare = static_cast<unsigned int*>(_aligned_malloc(unsigned(m_Width) * unsigned(m_Height) * 4u, 64));
    unsigned int* old = m_ColourBuffer;
    move_colourbuffer(m_Spare);
    m_Spare = old;
}
