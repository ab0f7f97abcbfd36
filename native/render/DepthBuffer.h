// A float depth target for offscreen rendering (smaller is nearer). Rows are
// Width values apart; contents are undefined until cleared.
#pragma once

class DepthBuffer_c {
public:
    DepthBuffer_c();
    ~DepthBuffer_c();

    // Frees the previous block, then allocates width x height floats, 64-byte
    // aligned. A byte count that does not fit in 32 bits (or a dimension above
    // 2^31 - 1) throws IllegalArgumentException; allocation failure throws
    // RuntimeException with the system's text. After a failure the buffer is
    // empty (0 x 0, no data).
    void Allocate(unsigned int width, unsigned int height);

    unsigned int Width;
    unsigned int Height;
    float* Data;

private:
    DepthBuffer_c(const DepthBuffer_c&) = delete;
    DepthBuffer_c& operator=(const DepthBuffer_c&) = delete;
};
