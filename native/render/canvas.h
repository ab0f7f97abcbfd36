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

    // Throws IllegalArgumentException unless width and height are positive and
    // a buffer of width * height 32-bit pixels stays below 2 GiB (the X image
    // and allocator sizes are 32-bit signed).
    static void check_size(int width, int height);

protected:
    // The colour buffer moves from m_ColourBuffer to `to` (a shared-memory
    // swap). The toolkit and the rasteriser follow when they were drawing into
    // this canvas; a different current target (an offscreen sprite) is left
    // alone.
    void move_colourbuffer(unsigned int* to);

    // Called before this canvas's buffers are freed: if the toolkit or the
    // rasteriser still point into them, the toolkit drops its target (zero
    // size, no buffers), so drawing before the next activation touches nothing.
    // `alsoColour` names a second colour buffer (the other shared-memory image).
    void release_from_toolkit(const unsigned int* alsoColour = nullptr);

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
    // Swaps the colour buffer with a second heap buffer of the same size, the
    // way a shared-memory flip does (the second buffer is allocated on the
    // first call).
    void swap_colourbuffer();

private:
    unsigned int* m_Spare = nullptr;
};
