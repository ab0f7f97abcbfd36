#include "render/canvas.h"

#include "jni/Exception.h"
#include "render/RasterizerState.h"
#include "render/toolkit.h"

void canvas::check_size(int width, int height) {
    if (width <= 0 || height <= 0) throw new IllegalArgumentException("canvas size must be positive");
    // 32-bit pixels; X images and the aligned allocator take 32-bit sizes.
    if ((unsigned long long)width * (unsigned long long)height * 4ull > 0x7FFFFFFFull)
        throw new IllegalArgumentException("canvas too large");
}

void canvas::move_colourbuffer(unsigned int* to) {
    unsigned int* from = m_ColourBuffer;
    m_ColourBuffer = to;
    if (!from || from == to) return;
    toolkit* tk = toolkit::m_pInstance;
    if (tk && tk->m_ColourBuffer == from) tk->m_ColourBuffer = to;
    if (Rasterizer_n::m_pColourBuffer == from) Rasterizer_n::m_pColourBuffer = to;
}

void canvas::release_from_toolkit(const unsigned int* alsoColour) {
    auto ours = [&](const void* p) {
        return p && (p == m_ColourBuffer || p == m_DepthBuffer || p == alsoColour);
    };
    toolkit* tk = toolkit::m_pInstance;
    if (tk && (ours(tk->m_ColourBuffer) || ours(tk->m_DepthBuffer))) tk->set_active_canvas(nullptr);
    if (ours(Rasterizer_n::m_pColourBuffer) || ours(Rasterizer_n::m_pDepthBuffer)) {
        Rasterizer_n::m_pColourBuffer = nullptr;
        Rasterizer_n::m_pDepthBuffer = nullptr;
        Rasterizer_n::m_ScreenPitch = 0;
    }
}
