// Private scratch state of one rendering thread. Each thread that draws has
// its own, so threads can draw different objects at once; every thread
// resource is linked into its toolkit's thread list while it lives.
#pragma once

#include <emmintrin.h>

#include "util/memorymanager/linkable.h"

class toolkit;

class alignas(16) threadresource {
public:
    static constexpr int MaxVertices = 16768;  // vertices one model or tile may project at once
    static constexpr int MaxMarks = 10000;     // vertex indices light sharing can mark

    enum Scratch_e { Scratch_Vertices, Scratch_Marks };

    // Every user of the scratch regions checks its count here first:
    // throws IllegalArgumentException unless `count` entries (0 included)
    // fit the region.
    static void check_scratch(Scratch_e region, long long count);

    // Allocated with _aligned_malloc (16-byte); create/destroy pair the
    // allocation with construction.
    static threadresource* create(toolkit& tk, int first, int second);
    static void destroy(threadresource* tr);

    threadresource(toolkit& tk, int first, int second);
    ~threadresource();

    void linkthread() {}
    void unlinkthread() {}

    // Point particles: positions (3 per particle, 12 fractional bits), ARGB
    // colours, world sizes (x 1/2048) and texture ids (65535: none), `count`
    // of each. Textured particles are scaled, depth-tested sprite blits of
    // their texture; untextured ones are depth-tested discs. First: colour is
    // written; Second: depth tested (the last two switches of the blit). May
    // request textures from Java (no pinned arrays while it runs).
    template <bool First, bool Second>
    void render_particles(const int* positions, const int* colours, const int* sizes, const short* textures,
                          int count);

    linkable m_Link;
    toolkit* m_Toolkit;
    int m_Second;
    int m_First;
    __m128 m_Vertices[MaxVertices];       // projected vertices of models and terrain tiles
    unsigned int m_VertexSide[MaxVertices];  // per-vertex values of model rendering (not initialised)
    unsigned short m_SharelightPass;
    unsigned short m_MarksA[MaxMarks];   // pass numbers per vertex of the model light sharing is called on
    unsigned short m_MarksB[MaxMarks];   // pass numbers per vertex of the other model
    unsigned int m_RenderExtent[12];     // screen extent and nearest depth of the model being drawn

private:
    threadresource(const threadresource&) = delete;
    threadresource& operator=(const threadresource&) = delete;
};
