// A Java AWT canvas tied to a colour buffer that X11 can show and a float depth
// buffer of the same size. The presentation code lives in the platform file
// (window glue); the toolkit reads only the fields below.
#pragma once

class canvas {
public:
    int width() const { return m_Width; }
    int height() const { return m_Height; }
    unsigned int* colourbuffer() const { return m_ColourBuffer; }
    float* depthbuffer() const { return m_DepthBuffer; }

    virtual ~canvas() {}

protected:
    int m_Width = 0;
    int m_Height = 0;
    unsigned int* m_ColourBuffer = nullptr;
    float* m_DepthBuffer = nullptr;
};

// A canvas with plain heap buffers and nothing to present to: the stand-in
// used by engine tests (and by builds without a window system).
class memory_canvas : public canvas {
public:
    memory_canvas(int width, int height);
    ~memory_canvas() override;
};
