// Canvas for builds without a window system: heap buffers that the toolkit
// draws into and a flip that presents nowhere.
#include "render/window_canvas.h"
#include "util/memorymanager/aligned.h"

namespace {

class headless_canvas : public window_canvas {
public:
    headless_canvas(int width, int height) { create_backbuffer(width, height); }
    ~headless_canvas() override { free_backbuffer(); }

    void flip(int, int, int, int) override {}
    void flip_dirtyrect(int, int, int, int, int, int) override {}
    void resized(jobject awtCanvas, int width, int height) override {
        check_size(width, height);
        free_backbuffer();
        create_backbuffer(width, height);
    }
    bool shared_memory() const override { return false; }

private:
    void create_backbuffer(int width, int height) {
        check_size(width, height);
        unsigned int bytes = unsigned(width) * unsigned(height) * 4u;
        m_DepthBuffer = static_cast<float*>(_aligned_malloc(bytes, 64));
        try {
            m_ColourBuffer = static_cast<unsigned int*>(_aligned_malloc(bytes, 64));
        } catch (...) {
            _aligned_free(m_DepthBuffer);
            m_DepthBuffer = nullptr;
            throw;
        }
        m_Width = width;
        m_Height = height;
    }
    void free_backbuffer() {
        release_from_toolkit();
        _aligned_free(m_ColourBuffer);
        _aligned_free(m_DepthBuffer);
        m_ColourBuffer = nullptr;
        m_DepthBuffer = nullptr;
        m_Width = 0;
        m_Height = 0;
    }
};

}  // namespace

window_canvas* create_window_canvas(JavaVM*, jobject, int width, int height) {
    return new headless_canvas(width, height);
}
