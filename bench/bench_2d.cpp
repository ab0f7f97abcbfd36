// 2D layer: full-screen clear against memset and a plain SSE2 streaming fill
// of the same buffer, filled rectangles in blend and add mode against
// pixman's OVER and ADD with a solid source on the same sizes, and glyphs per
// second for 8 x 12 letters of each font kind.
#include <benchmark/benchmark.h>
#include <emmintrin.h>
#include <pixman.h>

#include <cstdint>
#include <cstring>
#include <random>
#include <vector>

#include "ratio.h"
#include "render/canvas.h"
#include "render/toolkit.h"
#include "text/font_alpha.h"
#include "text/font_mono.h"
#include "text/font_paletted.h"

namespace {

const int SW = 1024, SH = 768;

// One toolkit drawing into a 1024 x 768 memory canvas, shared by all 2D benchmarks.
struct screen {
    toolkit* tk;
    memory_canvas canvas{SW, SH};
    screen() {
        tk = toolkit::create(nullptr, false, 0);
        tk->set_active_canvas(&canvas);
        tk->m_DepthBuffer = nullptr;
        toolkit::m_pInstance = tk;
    }
};

screen& the_screen() {
    static screen s;
    return s;
}

// ------------------------------------------------------------------- clears

void BM_Cls1024x768(benchmark::State& state) {
    screen& s = the_screen();
    s.tk->resetclipping();
    for (auto _ : state) {
        s.tk->cls(0xFF204060u);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * SW * SH * 4);
}
BENCHMARK(BM_Cls1024x768);

void BM_ClsPeerMemset(benchmark::State& state) {
    screen& s = the_screen();
    for (auto _ : state) {
        std::memset(s.tk->m_ColourBuffer, 0x40, size_t(SW) * SH * 4);
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * SW * SH * 4);
}
BENCHMARK(BM_ClsPeerMemset);

void BM_ClsPeerStreamFill(benchmark::State& state) {
    screen& s = the_screen();
    for (auto _ : state) {
        __m128i v = _mm_set1_epi32(0x40404040);
        __m128i* p = reinterpret_cast<__m128i*>(s.tk->m_ColourBuffer);  // 64-byte aligned
        for (int i = 0; i < SW * SH / 4; i += 4) {
            _mm_stream_si128(p + i, v);
            _mm_stream_si128(p + i + 1, v);
            _mm_stream_si128(p + i + 2, v);
            _mm_stream_si128(p + i + 3, v);
        }
        _mm_sfence();
        benchmark::ClobberMemory();
    }
    state.SetBytesProcessed(int64_t(state.iterations()) * SW * SH * 4);
}
BENCHMARK(BM_ClsPeerStreamFill);

PAVOQEN_RATIO("cls_1024x768_vs_best_of_memset_streamfill", "BM_Cls1024x768", "BM_ClsPeerMemset|BM_ClsPeerStreamFill");

// -------------------------------------------------------- filled rectangles

// Sizes (w, h) and the left edge x: x = 0 starts every row on a 16-byte
// boundary, x = 1 three pixels before one (the worst case for the scalar heads).
#define RECT_SIZES                                                                                     \
    ->Args({16, 16, 0})->Args({16, 16, 1})->Args({64, 64, 0})->Args({64, 64, 1})->Args({256, 256, 1}) \
        ->Args({1023, 767, 1})

void rect_ours(benchmark::State& state, unsigned int colour, unsigned int mode) {
    screen& s = the_screen();
    s.tk->resetclipping();
    const int w = int(state.range(0)), h = int(state.range(1)), x = int(state.range(2));
    for (auto _ : state) {
        s.tk->rect_fill(x, 1, w, h, colour, mode);
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(int64_t(state.iterations()) * w * h);
}

void rect_pixman(benchmark::State& state, unsigned int colour, pixman_op_t op) {
    screen& s = the_screen();
    const int w = int(state.range(0)), h = int(state.range(1)), x = int(state.range(2));
    pixman_image_t* dst = pixman_image_create_bits(PIXMAN_a8r8g8b8, SW, SH, s.tk->m_ColourBuffer, SW * 4);
    pixman_color_t c;
    c.alpha = uint16_t((colour >> 24) * 257);
    c.red = uint16_t(((colour >> 16) & 0xFF) * 257);
    c.green = uint16_t(((colour >> 8) & 0xFF) * 257);
    c.blue = uint16_t((colour & 0xFF) * 257);
    pixman_image_t* src = pixman_image_create_solid_fill(&c);
    for (auto _ : state) {
        pixman_image_composite32(op, src, nullptr, dst, 0, 0, 0, 0, x, 1, w, h);
        benchmark::ClobberMemory();
    }
    pixman_image_unref(src);
    pixman_image_unref(dst);
    state.SetItemsProcessed(int64_t(state.iterations()) * w * h);
}

void BM_RectBlend(benchmark::State& state) { rect_ours(state, 0x80336699u, 1); }
void BM_RectAdd(benchmark::State& state) { rect_ours(state, 0x20102030u, 2); }
void BM_RectPeerPixmanOver(benchmark::State& state) { rect_pixman(state, 0x80336699u, PIXMAN_OP_OVER); }
void BM_RectPeerPixmanAdd(benchmark::State& state) { rect_pixman(state, 0x20102030u, PIXMAN_OP_ADD); }
BENCHMARK(BM_RectBlend) RECT_SIZES;
BENCHMARK(BM_RectPeerPixmanOver) RECT_SIZES;
BENCHMARK(BM_RectAdd) RECT_SIZES;
BENCHMARK(BM_RectPeerPixmanAdd) RECT_SIZES;

PAVOQEN_RATIO_COUNTER("rect_blend_16x16_x0_vs_pixman_over", "BM_RectBlend/16/16/0", "BM_RectPeerPixmanOver/16/16/0", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_blend_16x16_x1_vs_pixman_over", "BM_RectBlend/16/16/1", "BM_RectPeerPixmanOver/16/16/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_blend_64x64_x0_vs_pixman_over", "BM_RectBlend/64/64/0", "BM_RectPeerPixmanOver/64/64/0", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_blend_64x64_x1_vs_pixman_over", "BM_RectBlend/64/64/1", "BM_RectPeerPixmanOver/64/64/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_blend_256x256_x1_vs_pixman_over", "BM_RectBlend/256/256/1", "BM_RectPeerPixmanOver/256/256/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_blend_1023x767_x1_vs_pixman_over", "BM_RectBlend/1023/767/1", "BM_RectPeerPixmanOver/1023/767/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_16x16_x0_vs_pixman_add", "BM_RectAdd/16/16/0", "BM_RectPeerPixmanAdd/16/16/0", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_16x16_x1_vs_pixman_add", "BM_RectAdd/16/16/1", "BM_RectPeerPixmanAdd/16/16/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_64x64_x0_vs_pixman_add", "BM_RectAdd/64/64/0", "BM_RectPeerPixmanAdd/64/64/0", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_64x64_x1_vs_pixman_add", "BM_RectAdd/64/64/1", "BM_RectPeerPixmanAdd/64/64/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_256x256_x1_vs_pixman_add", "BM_RectAdd/256/256/1", "BM_RectPeerPixmanAdd/256/256/1", "items_per_second");
PAVOQEN_RATIO_COUNTER("rect_add_1023x767_x1_vs_pixman_add", "BM_RectAdd/1023/767/1", "BM_RectPeerPixmanAdd/1023/767/1", "items_per_second");

// ------------------------------------------------------------------ glyphs

const int GLYPHS = 96, GW = 8, GH = 12;

template <class F>
F* make_font(memorymanager* pool) {
    F* f = new F(pool, GLYPHS);
    std::mt19937 rng(42);
    std::vector<unsigned char> bits(GW * GH);
    for (int g = 0; g < GLYPHS; ++g) {
        // about 40 % of the cell set, coverage/palette values spread
        for (auto& b : bits) b = (rng() % 10 < 4) ? (unsigned char)(1 + rng() % 255) : 0;
        f->set_glyph(g, bits.data(), int(bits.size()));
    }
    auto metric = [&](int v) {
        sharedarray<int> a(pool, GLYPHS);
        for (int i = 0; i < GLYPHS; ++i) a[i] = v;
        return a;
    };
    f->m_Widths = metric(GW);
    f->m_Heights = metric(GH);
    f->m_XOffsets = metric(0);
    f->m_YOffsets = metric(0);
    f->validate();
    return f;
}

memorymanager& font_pool() {
    static memorymanager pool(1 << 20);
    return pool;
}

// One iteration writes a line of 100 letters; positions walk the screen.
template <class F, class Plot>
void glyph_bench(benchmark::State& state, F* f, Plot plot) {
    screen& s = the_screen();
    s.tk->resetclipping();
    int x = 0, y = 0, g = 0;
    for (auto _ : state) {
        for (int i = 0; i < 100; ++i) {
            plot(*f, short(g), x, y);
            if (++g == GLYPHS) g = 0;
            x += GW + 1;
            if (x > SW - GW) {
                x = (x + 3) % 7;
                y += GH;
                if (y > SH - GH) y = 0;
            }
        }
        benchmark::ClobberMemory();
    }
    state.SetItemsProcessed(int64_t(state.iterations()) * 100);
}

void BM_GlyphMonoOpaque8x12(benchmark::State& state) {
    static font_mono* f = make_font<font_mono>(&font_pool());
    glyph_bench(state, f, [](font_mono& ft, short g, int x, int y) { ft.plotletter(g, x, y, 0xFFFFFFFFu, false); });
}
void BM_GlyphMonoBlended8x12(benchmark::State& state) {
    static font_mono* f = make_font<font_mono>(&font_pool());
    glyph_bench(state, f, [](font_mono& ft, short g, int x, int y) { ft.plotletter(g, x, y, 0x80FFFFFFu, false); });
}
void BM_GlyphAlpha8x12(benchmark::State& state) {
    static font_alpha* f = make_font<font_alpha>(&font_pool());
    glyph_bench(state, f, [](font_alpha& ft, short g, int x, int y) { ft.plotletter(g, x, y, 0xFFFFFFFFu, false); });
}
void BM_GlyphPaletted8x12(benchmark::State& state) {
    static font_paletted* f = [] {
        font_paletted* p = make_font<font_paletted>(&font_pool());
        p->m_Palette = sharedarray<unsigned int>(&font_pool(), 256);
        for (int i = 0; i < 256; ++i) p->m_Palette[i] = 0xFF000000u | unsigned(i * 0x010101);
        return p;
    }();
    glyph_bench(state, f, [](font_paletted& ft, short g, int x, int y) { ft.plotletter(g, x, y, 0, false); });
}
void BM_GlyphMonoUpwards8x12(benchmark::State& state) {
    static font_mono* f = make_font<font_mono>(&font_pool());
    glyph_bench(state, f, [](font_mono& ft, short g, int x, int y) { ft.plotletter_upwards(g, x, y, 0xFFFFFFFFu, false); });
}
BENCHMARK(BM_GlyphMonoOpaque8x12);
BENCHMARK(BM_GlyphMonoBlended8x12);
BENCHMARK(BM_GlyphAlpha8x12);
BENCHMARK(BM_GlyphPaletted8x12);
BENCHMARK(BM_GlyphMonoUpwards8x12);

}  // namespace
