// Triangle throughput at 1024 x 768: Gouraud depth-tested, textured
// (perspective, modulated, wrapped), texture-blend and alpha-blended
// triangles of about 8, 64 and 2000 pixels, each beside Mesa's llvmpipe
// (OSMesa, one rasteriser thread) drawing the same triangles in the same run.
// Every triangle lies on screen at depth 0.5 with a "less or equal" test, so
// every pixel passes in both renderers. Ratios compare triangles per second
// of process CPU time (llvmpipe's rasteriser thread included).
#define GL_GLEXT_PROTOTYPES 1
#include <GL/gl.h>
#include <GL/glext.h>
#include <GL/osmesa.h>
#include <benchmark/benchmark.h>

#include <time.h>

#include <cmath>
#include <cstdlib>
#include <cstring>
#include <string>
#include <vector>

#include "ratio.h"
#include "render/Rasterizer.h"
#include "util/memorymanager/aligned.h"

using namespace Rasterizer_n;

namespace {

constexpr int kW = 1024, kH = 768;

enum Mode { Gouraud, Textured, TexBlend, Alpha, ModeCount };
const char* const kModeNames[ModeCount] = {"gouraud", "textured", "texblend", "alpha"};
const int kSizes[3] = {8, 64, 2000};
const int kCounts[3] = {20000, 5000, 400};

struct Rng {
    unsigned long long s = 0x1234567ull;
    unsigned u32() {
        s = s * 6364136223846793005ull + 1442695040888963407ull;
        return unsigned(s >> 33);
    }
    float uni(float lo, float hi) { return lo + (hi - lo) * float(u32() & 0xFFFFFF) / float(1 << 24); }
};

// One triangle of the workload, in the form both renderers take.
struct Tri {
    float x[3], y[3], w[3], u[3], v[3];
    unsigned char rgba[3][4];
};

std::vector<Tri> MakeTriangles(int area, int count) {
    Rng r;
    r.s += unsigned(area);
    std::vector<Tri> out(static_cast<size_t>(count));
    for (Tri& t : out) {
        float a0 = r.uni(0.0f, 6.2831853f);
        float px[3], py[3];
        for (int i = 0; i < 3; ++i) {
            float a = a0 + 2.0943951f * float(i) + r.uni(-0.4f, 0.4f);
            px[i] = std::cos(a);
            py[i] = std::sin(a);
        }
        float ar = 0.5f * std::fabs((px[1] - px[0]) * (py[2] - py[0]) - (px[2] - px[0]) * (py[1] - py[0]));
        float s = std::sqrt(float(area) / ar);
        float cx = r.uni(s + 1.0f, kW - s - 1.0f), cy = r.uni(s + 1.0f, kH - s - 1.0f);
        for (int i = 0; i < 3; ++i) {
            t.x[i] = cx + px[i] * s;
            t.y[i] = cy + py[i] * s;
            t.w[i] = r.uni(1.0f, 2.0f);
            t.u[i] = r.uni(-300.0f, 300.0f);
            t.v[i] = r.uni(-300.0f, 300.0f);
            for (int k = 0; k < 4; ++k) t.rgba[i][k] = (unsigned char)(128 + (r.u32() & 127));
        }
    }
    return out;
}

double ProcessCpuSeconds() {
    timespec t;
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &t);
    return double(t.tv_sec) + 1e-9 * double(t.tv_nsec);
}

// Rates per second of CPU time of the whole process (llvmpipe's rasteriser
// thread included), so that the comparison holds on a busy machine too.
void SetRates(benchmark::State& state, size_t triangles, int area, double cpu) {
    const double tris = double(state.iterations()) * double(triangles);
    state.SetItemsProcessed(int64_t(tris));
    state.counters["px/s"] = benchmark::Counter(tris * area, benchmark::Counter::kIsRate);
    state.counters["tri/cpu_s"] = cpu > 0 ? tris / cpu : 0.0;
    state.counters["px/cpu_s"] = cpu > 0 ? tris * area / cpu : 0.0;
}

std::vector<unsigned> MakeTexture(unsigned seed) {
    Rng r;
    r.s += seed;
    std::vector<unsigned> t(256 * 128);
    for (unsigned& p : t) p = r.u32() | 0xFF000000u;
    return t;
}

// --- ours ------------------------------------------------------------------

struct OurTarget {
    unsigned* colour;
    float* depth;
    OurTarget() {
        colour = static_cast<unsigned*>(_aligned_malloc(kW * kH * 4, 64));
        depth = static_cast<float*>(_aligned_malloc(kW * kH * 4, 64));
        std::memset(colour, 0, kW * kH * 4);
        for (int i = 0; i < kW * kH; ++i) depth[i] = 3.4e38f;
        SetTarget(colour, depth, kW, kW, kH);
        Viewport_s vp = {0, 0, kW, kH, 0.0f, 1.0f};
        SetViewport(vp);
    }
    ~OurTarget() {
        _aligned_free(colour);
        _aligned_free(depth);
    }
};

void BM_Ours(benchmark::State& state, Mode mode, int sizeIndex) {
    OurTarget target;
    std::vector<Tri> tris = MakeTriangles(kSizes[sizeIndex], kCounts[sizeIndex]);
    std::vector<unsigned> tex0 = MakeTexture(1), tex1 = MakeTexture(2), tex2 = MakeTexture(3);
    Triangle_s* ts = static_cast<Triangle_s*>(_aligned_malloc(unsigned(sizeof(Triangle_s) * tris.size()), 16));
    for (size_t n = 0; n < tris.size(); ++n) {
        const Tri& s = tris[n];
        Triangle_s& t = ts[n];
        std::memset(&t, 0, sizeof t);
        for (int i = 0; i < 3; ++i) {
            t.m_Positions[i] = _mm_setr_ps(s.x[i], s.y[i], 0.5f, 1.0f);
            t.m_Colours[i] = _mm_setr_epi16(short(s.rgba[i][2] << 8), short(s.rgba[i][1] << 8),
                                            short(s.rgba[i][0] << 8), short(s.rgba[i][3] << 8), 0, 0, 0, 0);
            // texture coordinates divided by w, as a perspective projection leaves them
            t.m_TexCoords[i] = _mm_setr_ps(s.u[i], s.v[i], 0.0f, 0.0f);
        }
        t.m_Alpha = 128u * 0x10001u;
        t.m_pTexture = tex0.data();
        t.m_pTexture2 = tex1.data();
        t.m_pTexture3 = tex2.data();
    }
    RenderTriangleFn fn = nullptr;
    switch (mode) {
        case Gouraud: fn = FindVariant(1, 0, 0, false, 0, 0, false, false, true, true, true); break;
        case Textured: fn = FindVariant(2, 1, 1, false, 0, 0, false, false, true, true, true); break;
        case TexBlend: fn = FindVariant(3, 0, 0, false, 0, 0, false, false, true, true, true); break;
        default: fn = FindVariant(1, 0, 0, false, 0, 3, false, false, false, true, true); break;
    }
    const size_t count = tris.size();
    double cpu = -ProcessCpuSeconds();
    for (auto _ : state) {
        for (size_t n = 0; n < count; ++n) fn(ts[n]);
        benchmark::ClobberMemory();
    }
    cpu += ProcessCpuSeconds();
    SetRates(state, count, kSizes[sizeIndex], cpu);
    _aligned_free(ts);
}

// --- llvmpipe ----------------------------------------------------------------

struct GL {
    OSMesaContext ctx = nullptr;
    std::vector<unsigned> buffer = std::vector<unsigned>(size_t(kW) * kH);
    GLuint tex[3] = {0, 0, 0};
    GLuint blendProgram = 0;
    bool ok = false;
    GL() {
        setenv("LP_NUM_THREADS", "1", 0);
        ctx = OSMesaCreateContextExt(OSMESA_BGRA, 24, 0, 0, nullptr);
        if (!ctx || !OSMesaMakeCurrent(ctx, buffer.data(), GL_UNSIGNED_BYTE, kW, kH)) return;
        glViewport(0, 0, kW, kH);
        glMatrixMode(GL_PROJECTION);
        glLoadIdentity();
        glOrtho(0, kW, kH, 0, -1, 1);
        glMatrixMode(GL_MODELVIEW);
        glLoadIdentity();
        glGenTextures(3, tex);
        for (int i = 0; i < 3; ++i) {
            std::vector<unsigned> t = MakeTexture(unsigned(i + 1)), packed(128 * 128);
            for (int y = 0; y < 128; ++y) std::memcpy(&packed[size_t(y) * 128], &t[size_t(y) * 256], 128 * 4);
            glBindTexture(GL_TEXTURE_2D, tex[i]);
            glTexImage2D(GL_TEXTURE_2D, 0, GL_RGBA8, 128, 128, 0, GL_BGRA, GL_UNSIGNED_BYTE, packed.data());
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MIN_FILTER, GL_NEAREST);
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_MAG_FILTER, GL_NEAREST);
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_S, GL_REPEAT);
            glTexParameteri(GL_TEXTURE_2D, GL_TEXTURE_WRAP_T, GL_REPEAT);
        }
        const char* vs =
            "attribute vec3 weights; varying vec3 w;\n"
            "void main() { gl_Position = ftransform(); gl_FrontColor = gl_Color;\n"
            "  gl_TexCoord[0] = gl_MultiTexCoord0; w = weights; }\n";
        const char* fs =
            "uniform sampler2D t0, t1, t2; varying vec3 w;\n"
            "void main() { vec2 st = gl_TexCoord[0].st;\n"
            "  gl_FragColor = (texture2D(t0, st) * w.x + texture2D(t1, st) * w.y + texture2D(t2, st) * w.z) * gl_Color; }\n";
        GLuint v = glCreateShader(GL_VERTEX_SHADER), f = glCreateShader(GL_FRAGMENT_SHADER);
        glShaderSource(v, 1, &vs, nullptr);
        glShaderSource(f, 1, &fs, nullptr);
        glCompileShader(v);
        glCompileShader(f);
        blendProgram = glCreateProgram();
        glAttachShader(blendProgram, v);
        glAttachShader(blendProgram, f);
        glBindAttribLocation(blendProgram, 1, "weights");
        glLinkProgram(blendProgram);
        GLint linked = 0;
        glGetProgramiv(blendProgram, GL_LINK_STATUS, &linked);
        glUseProgram(blendProgram);
        glUniform1i(glGetUniformLocation(blendProgram, "t0"), 0);
        glUniform1i(glGetUniformLocation(blendProgram, "t1"), 1);
        glUniform1i(glGetUniformLocation(blendProgram, "t2"), 2);
        glUseProgram(0);
        ok = linked != 0;
    }
    ~GL() {
        if (ctx) OSMesaDestroyContext(ctx);
    }
};

GL& gl() {
    static GL g;
    return g;
}

void BM_Llvmpipe(benchmark::State& state, Mode mode, int sizeIndex) {
    GL& g = gl();
    if (!g.ok) {
        state.SkipWithError("OSMesa context unavailable");
        return;
    }
    std::vector<Tri> tris = MakeTriangles(kSizes[sizeIndex], kCounts[sizeIndex]);
    const size_t nv = tris.size() * 3;
    std::vector<float> pos(nv * 4), st(nv * 2), weights(nv * 3);
    std::vector<unsigned char> col(nv * 4);
    for (size_t n = 0; n < tris.size(); ++n)
        for (int i = 0; i < 3; ++i) {
            const Tri& t = tris[n];
            size_t k = n * 3 + size_t(i);
            float w = t.w[i];  // homogeneous w: the texture interpolation is perspective-correct
            pos[k * 4 + 0] = t.x[i] * w;
            pos[k * 4 + 1] = t.y[i] * w;
            pos[k * 4 + 2] = 0.0f;
            pos[k * 4 + 3] = w;
            st[k * 2 + 0] = t.u[i] / 128.0f;
            st[k * 2 + 1] = t.v[i] / 128.0f;
            std::memcpy(&col[k * 4], t.rgba[i], 4);
            for (int j = 0; j < 3; ++j) weights[k * 3 + size_t(j)] = i == j ? 1.0f : 0.0f;
        }
    glClearColor(0, 0, 0, 0);
    glClearDepth(1.0);
    glClear(GL_COLOR_BUFFER_BIT | GL_DEPTH_BUFFER_BIT);
    glEnable(GL_DEPTH_TEST);
    glDepthFunc(GL_LEQUAL);
    glDepthMask(mode == Alpha ? GL_FALSE : GL_TRUE);
    glShadeModel(GL_SMOOTH);
    glEnableClientState(GL_VERTEX_ARRAY);
    glEnableClientState(GL_COLOR_ARRAY);
    glVertexPointer(4, GL_FLOAT, 0, pos.data());
    glColorPointer(4, GL_UNSIGNED_BYTE, 0, col.data());
    if (mode == Textured || mode == TexBlend) {
        glEnableClientState(GL_TEXTURE_COORD_ARRAY);
        glTexCoordPointer(2, GL_FLOAT, 0, st.data());
    }
    if (mode == Textured) {
        glActiveTexture(GL_TEXTURE0);
        glBindTexture(GL_TEXTURE_2D, g.tex[0]);
        glEnable(GL_TEXTURE_2D);
        glTexEnvi(GL_TEXTURE_ENV, GL_TEXTURE_ENV_MODE, GL_MODULATE);
    }
    if (mode == TexBlend) {
        for (int i = 0; i < 3; ++i) {
            glActiveTexture(GLenum(GL_TEXTURE0 + i));
            glBindTexture(GL_TEXTURE_2D, g.tex[i]);
        }
        glActiveTexture(GL_TEXTURE0);
        glUseProgram(g.blendProgram);
        glEnableVertexAttribArray(1);
        glVertexAttribPointer(1, 3, GL_FLOAT, GL_FALSE, 0, weights.data());
    }
    if (mode == Alpha) {
        glEnable(GL_BLEND);
        glBlendColor(0, 0, 0, 128.0f / 255.0f);
        glBlendFunc(GL_CONSTANT_ALPHA, GL_ONE_MINUS_CONSTANT_ALPHA);
    }
    glFinish();
    double cpu = -ProcessCpuSeconds();
    for (auto _ : state) {
        glDrawArrays(GL_TRIANGLES, 0, GLsizei(nv));
        glFinish();
    }
    cpu += ProcessCpuSeconds();
    SetRates(state, tris.size(), kSizes[sizeIndex], cpu);
    glDisable(GL_BLEND);
    glDisable(GL_TEXTURE_2D);
    glUseProgram(0);
    glDisableVertexAttribArray(1);
    glDisableClientState(GL_TEXTURE_COORD_ARRAY);
    glDisableClientState(GL_COLOR_ARRAY);
    glDisableClientState(GL_VERTEX_ARRAY);
    glDepthMask(GL_TRUE);
}

// Benchmark names "raster_<mode>_<size>px_ours" / "..._llvmpipe" and one ratio line each.
struct Names {
    std::string ours[ModeCount][3], peer[ModeCount][3], ratio[ModeCount][3];
    Names() {
        for (int m = 0; m < ModeCount; ++m)
            for (int s = 0; s < 3; ++s) {
                std::string base = std::string(kModeNames[m]) + "_" + std::to_string(kSizes[s]) + "px";
                ours[m][s] = "raster_" + base + "_ours";
                peer[m][s] = "raster_" + base + "_llvmpipe";
                ratio[m][s] = base + "_vs_llvmpipe";
            }
    }
};
const Names& names() {
    static Names n;
    return n;
}

const bool registered = [] {
    for (int m = 0; m < ModeCount; ++m)
        for (int s = 0; s < 3; ++s) {
            benchmark::RegisterBenchmark(names().ours[m][s].c_str(), BM_Ours, Mode(m), s)->UseRealTime();
            benchmark::RegisterBenchmark(names().peer[m][s].c_str(), BM_Llvmpipe, Mode(m), s)->UseRealTime();
            bench_ratios().push_back({names().ratio[m][s], names().ours[m][s] + "/real_time",
                                      names().peer[m][s] + "/real_time", "tri/cpu_s"});
        }
    return true;
}();

}  // namespace
