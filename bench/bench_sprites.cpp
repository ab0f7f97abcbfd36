// Sprite blits into a 1024 x 768 target: unscaled alpha blending of 64 x 64 and
// 256 x 256 ARGB sprites whose alpha is partial everywhere, beside pixman's
// OVER of the same pixels premultiplied and llvmpipe (OSMesa, one thread)
// drawing them as blended textured quads; scaled and parallelogram blits;
// particles per second. Each blit iteration draws 16 sprites at 16 fixed
// positions (varied alignment).
#include <GL/gl.h>
#include <GL/osmesa.h>
#include <benchmark/benchmark.h>
#include <pixman.h>

#include <cmath>
#include <cstdint>
#include <random>
#include <vector>

#include "ratio.h"
#include "render/canvas.h"
#include "render/toolkit.h"
#include "render/RasterizerState.h"
#include "render/threadresource.h"
#include "sprite/Sprite.h"
#include "texture/texturecache.h"

namespace {

const int SW = 1024, SH = 768, kPerIteration = 16;

struct target {
    toolkit* tk;
    memory_canvas canvas{SW, SH};
    target() {
        tk = toolkit::create(nullptr, false, 0);
        tk->set_active_canvas(&canvas);
        tk->m_DepthBuffer = nullptr;
    }
};

target& the_target() {
    static target t;
    return t;
}

// An n x n sprite with alpha in 1..254 everywhere and random colours.
struct test_sprite {
    Sprite_c sprite;
    std::vector<uint32_t> premultiplied;
    explicit test_sprite(int n) {
        std::mt19937 rng(n);
        sprite.Allocate(n, n);
        premultiplied.resize(size_t(n) * n);
        for (int i = 0; i < n * n; ++i) {
            uint32_t a = 1 + rng() % 254, c = rng() & 0xFFFFFFu;
            sprite.Pixels[i] = a << 24 | c;
            uint32_t p = a << 24;
            for (int s = 0; s < 24; s += 8) p |= (((c >> s) & 255) * a / 255) << s;
            premultiplied[size_t(i)] = p;
        }
    }
};

test_sprite& sprite_of_size(int n) {
    static test_sprite s64(64), s256(256);
    return n == 64 ? s64 : s256;
}

// Fixed positions spread over the screen, at every 4-pixel alignment.
struct positions {
    int x[kPerIteration], y[kPerIteration];
    explicit positions(int w, int h) {
        std::mt19937 rng(w * 7 + h);
        for (int i = 0; i < kPerIteration; ++i) {
            x[i] = int(rng() % unsigned(SW - w - 4)) / 4 * 4 + i % 4;
            y[i] = int(rng() % unsigned(SH - h));
        }
    }
};

void set_rate(benchmark::State& state, long long pixelsPerIteration) {
    state.counters["Mpixel_per_s"] =
        benchmark::Counter(double(pixelsPerIteration) * double(state.iterations()) / 1e6, benchmark::Counter::kIsRate);
}

// ------------------------------------------------------------- unscaled alpha

void BM_SpriteAlpha(benchmark::State& state) {
    int n = int(state.range(0));
    target& t = the_target();
    t.tk->resetclipping();
    const Sprite_c& s = sprite_of_size(n).sprite;
    positions pos(n, n);
    Sprite_c::RenderParams_s p = {};
    for (auto _ : state) {
        for (int i = 0; i < kPerIteration; ++i) {
            p.x = pos.x[i], p.y = pos.y[i];
            s.Draw(*t.tk, Sprite_c::ColourOp_None, Sprite_c::SpriteBlend_Alpha, p);
        }
        benchmark::ClobberMemory();
    }
    set_rate(state, (long long)kPerIteration * n * n);
}
BENCHMARK(BM_SpriteAlpha)->Arg(64)->Arg(256);

void BM_SpritePeerPixmanOver(benchmark::State& state) {
    int n = int(state.range(0));
    target& t = the_target();
    test_sprite& ts = sprite_of_size(n);
    positions pos(n, n);
    pixman_image_t* dst = pixman_image_create_bits(PIXMAN_a8r8g8b8, SW, SH, t.tk->m_ColourBuffer, SW * 4);
    pixman_image_t* src = pixman_image_create_bits(PIXMAN_a8r8g8b8, n, n, ts.premultiplied.data(), n * 4);
    for (auto _ : state) {
        for (int i = 0; i < kPerIteration; ++i)
            pixman_image_composite32(PIXMAN_OP_OVER, src, nullptr, dst, 0, 0, 0, 0, pos.x[i], pos.y[i], n, n);
        benchmark::ClobberMemory();
    }
    pixman_image_unref(src);
    pixman_image_unref(dst);
    set_rate(state, (long long)kPerIteration * n * n);
}
BENCHMARK(BM_SpritePeerPixmanOver)->Arg(64)->Arg(256);

// llvmpipe through OSMesa: the same sprites as textured quads with
// SRC_ALPHA, ONE_MINUS_SRC_ALPHA blending, nearest sampling, one glFinish per
// iteration.
struct gl_target {
    OSMesaContext ctx = nullptr;
    std::vector<uint32_t> buffer;
    GLuint tex[2] = {0, 0};
    bool ok = false;
    gl_target() : buffer(size_t(SW) * SH, 0xFF202020u) {
        ctx = OSMesaCreateContextExt(OSMESA_BGRA, 0, 0, 0, nullptr);
        if (!ctx || !OSMesaMakeCurrent(ctx, buffer.data(), GL_UNSIGNED_BYTE, SW, SH)) return;
        glViewport(0, 0, SW, SH);
        glMatrixMode(GL_PROJECTION);
        glLoadIdentity();
        glOrtho(0, SW, SH, 0, -1, 1);
        glMatrixMode(GL_MODELVIEW);
        glLoadIdentity();
        glGenTextures(2, tex);
        const int sizes[2] = {64, 256};
        for (int k = 0; k < 2; ++k) {
            glBindTexture(GL_TEXTURE_2D, tex[k]);
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_NEAREST);
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_NEAREST);
            glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA, sizes[k], sizes[k], 0, GL_BGRA, GL_UNSIGNED_BYTE,
                         sprite_of_size(sizes[k]).sprite.Pixels);
        }
        glEnable(GL_TEXTURE_2D);
        glEnable(GL_BLEND);
        glBlendFunc(GL_SRC_ALPHA, GL_ONE_MINUS_SRC_ALPHA);
        glDisable(GL_DEPTH_TEST);
        ok = glGetError() == GL_NO_ERROR;
    }
    ~gl_target() {
        if (ctx) OSMesaDestroyContext(ctx);
    }
};

void BM_SpritePeerLlvmpipe(benchmark::State& state) {
    int n = int(state.range(0));
    static gl_target gl;
    if (!gl.ok) {
        state.SkipWithError("OSMesa context not available");
        return;
    }
    positions pos(n, n);
    glBindTexture(GL_TEXTURE_2D, gl.tex[n == 64 ? 0 : 1]);
    for (auto _ : state) {
        glBegin(GL_QUADS);
        for (int i = 0; i < kPerIteration; ++i) {
            float x = float(pos.x[i]), y = float(pos.y[i]);
            glTexCoord2f(0, 0), glVertex2f(x, y);
            glTexCoord2f(1, 0), glVertex2f(x + n, y);
            glTexCoord2f(1, 1), glVertex2f(x + n, y + n);
            glTexCoord2f(0, 1), glVertex2f(x, y + n);
        }
        glEnd();
        glFinish();
    }
    set_rate(state, (long long)kPerIteration * n * n);
}
BENCHMARK(BM_SpritePeerLlvmpipe)->Arg(64)->Arg(256)->UseRealTime();

PAVOQEN_RATIO_COUNTER("sprite_alpha_64x64_vs_pixman_over", "BM_SpriteAlpha/64", "BM_SpritePeerPixmanOver/64",
                      "Mpixel_per_s");
PAVOQEN_RATIO_COUNTER("sprite_alpha_256x256_vs_pixman_over", "BM_SpriteAlpha/256", "BM_SpritePeerPixmanOver/256",
                      "Mpixel_per_s");
PAVOQEN_RATIO_COUNTER("sprite_alpha_64x64_vs_llvmpipe", "BM_SpriteAlpha/64", "BM_SpritePeerLlvmpipe/64/real_time",
                      "Mpixel_per_s");
PAVOQEN_RATIO_COUNTER("sprite_alpha_256x256_vs_llvmpipe", "BM_SpriteAlpha/256", "BM_SpritePeerLlvmpipe/256/real_time",
                      "Mpixel_per_s");

// ------------------------------------------------------------- other kinds

// 64 x 64 drawn at 128 x 128 (magnified) and 256 x 256 at 200 x 200 (minified).
void BM_SpriteScaledAlpha(benchmark::State& state) {
    int n = int(state.range(0)), d = int(state.range(1));
    target& t = the_target();
    t.tk->resetclipping();
    const Sprite_c& s = sprite_of_size(n).sprite;
    positions pos(d, d);
    Sprite_c::RenderParams_s p = {};
    p.width = p.height = d;
    for (auto _ : state) {
        for (int i = 0; i < kPerIteration; ++i) {
            p.x = pos.x[i], p.y = pos.y[i];
            s.DrawScaled(*t.tk, Sprite_c::ColourOp_None, Sprite_c::SpriteBlend_Alpha, p);
        }
        benchmark::ClobberMemory();
    }
    set_rate(state, (long long)kPerIteration * d * d);
}
BENCHMARK(BM_SpriteScaledAlpha)->Args({64, 128})->Args({256, 200});

// Modulated and tinted unscaled blits (the 16-bit colour operations).
void BM_SpriteModulateAlpha256(benchmark::State& state) {
    target& t = the_target();
    t.tk->resetclipping();
    const Sprite_c& s = sprite_of_size(256).sprite;
    positions pos(256, 256);
    Sprite_c::RenderParams_s p = {};
    p.colour = 0xC0A0F080u;
    for (auto _ : state) {
        for (int i = 0; i < kPerIteration; ++i) {
            p.x = pos.x[i], p.y = pos.y[i];
            s.Draw(*t.tk, Sprite_c::ColourOp_Modulate, Sprite_c::SpriteBlend_Alpha, p);
        }
        benchmark::ClobberMemory();
    }
    set_rate(state, (long long)kPerIteration * 256 * 256);
}
BENCHMARK(BM_SpriteModulateAlpha256);

// 256 x 256 rotated by 30 degrees at scale 1 (the rate counts the
// parallelogram's area, 256 x 256 pixels).
void BM_SpriteParallelogramAlpha256(benchmark::State& state) {
    target& t = the_target();
    t.tk->resetclipping();
    const Sprite_c& s = sprite_of_size(256).sprite;
    positions pos(400, 400);
    const float c = std::cos(0.5235988f) * 256, sn = std::sin(0.5235988f) * 256;
    Sprite_c::ParallelogramRenderParams_s p = {};
    for (auto _ : state) {
        for (int i = 0; i < kPerIteration; ++i) {
            float x = float(pos.x[i]) + 128, y = float(pos.y[i]);
            p.x0 = x, p.y0 = y;
            p.x1 = x + c, p.y1 = y + sn;
            p.x2 = x - sn, p.y2 = y + c;
            s.DrawParallelogram(*t.tk, Sprite_c::ColourOp_None, Sprite_c::SpriteBlend_Alpha, p);
        }
        benchmark::ClobberMemory();
    }
    set_rate(state, (long long)kPerIteration * 256 * 256);
}
BENCHMARK(BM_SpriteParallelogramAlpha256);

// ------------------------------------------------------------- particles

// 10,000 particles 4 to 24 pixels across spread over a 1024 x 768 colour and
// depth target, textured (one resident texture) or untextured (discs).
struct particle_scene {
    toolkit* tk;
    memory_canvas canvas{SW, SH};
    threadresource* tr;
    std::vector<int> pos, colours, sizes;
    std::vector<short> textured, untextured;
    static const int kCount = 10000;
    particle_scene() {
        tk = toolkit::create(nullptr, true, 16);
        std::vector<int> texels(128 * 128);
        std::mt19937 rng(3);
        for (int& t : texels) t = int(uint32_t(1 + rng() % 254) << 24 | (rng() & 0xFFFFFF));
        texturemetrics m = {};
        tk->upload_texture(1, texels.data(), m);
        tr = threadresource::create(*tk, 0, 0);
        for (int i = 0; i < kCount; ++i) {
            pos.push_back(int(rng() % SW) << 12);
            pos.push_back(int(rng() % SH) << 12);
            pos.push_back(0);
            colours.push_back(int(rng() | 0x80000000u));
            sizes.push_back(int(4 + rng() % 21) * 2048);
            textured.push_back(1);
            untextured.push_back(-1);
        }
    }
    // world (x, y, 0) on pixel (x, y) at depth 1/2, right axis +x
    void activate() {
        tk->set_active_canvas(&canvas);
        Rasterizer_n::Viewport_s vp = *Rasterizer_n::GetViewport();
        vp.MinZ = 0.0f, vp.MaxZ = 1.0f;
        Rasterizer_n::SetViewport(vp);
        const float proj[16] = {2.0f / SW, 0, 0, 0, 0, 2.0f / SH, 0, 0, 0, 0, 1, 0, -1, -1, 0, 1};
        tk->set_projection(Matrix_c(proj));
        tk->set_camera(Matrix_c());
    }
};

particle_scene& the_particles() {
    static particle_scene s;
    return s;
}

void particles(benchmark::State& state, bool withTexture) {
    particle_scene& s = the_particles();
    s.activate();
    const std::vector<short>& tex = withTexture ? s.textured : s.untextured;
    for (auto _ : state) {
        s.tk->zbuffer_clear(0, 0, SW, SH, 3.4e38f);
        s.tr->render_particles<true, true>(s.pos.data(), s.colours.data(), s.sizes.data(), tex.data(),
                                           particle_scene::kCount);
        benchmark::ClobberMemory();
    }
    state.counters["particles_per_s"] =
        benchmark::Counter(double(particle_scene::kCount) * double(state.iterations()), benchmark::Counter::kIsRate);
}

void BM_ParticlesTextured10k(benchmark::State& state) { particles(state, true); }
void BM_ParticlesUntextured10k(benchmark::State& state) { particles(state, false); }
BENCHMARK(BM_ParticlesTextured10k);
BENCHMARK(BM_ParticlesUntextured10k);

}  // namespace
