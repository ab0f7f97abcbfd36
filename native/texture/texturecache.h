// Texture cache: up to 200 resident textures of 128 x 128 ARGB texels in one
// store laid out for the rasteriser (row stride 256 texels, two textures side
// by side per 128-row band), least-recently-used eviction, requests for missing
// textures through the toolkit, per-frame scroll offsets, and per-id metrics.
//
// Every stored texture is a blurred copy of the uploaded image (separable
// five-tap Gaussian, see copy_and_blur_texture).
//
// gettex may call into Java (the toolkit's texture request); callers must not
// hold pinned Java arrays while calling it.
#pragma once

#include <emmintrin.h>

#include <mutex>

class toolkit;

// Properties of one texture id, in the order the Java side passes them.
struct texturemetrics {
    unsigned short averagehsl;   // average colour, 16-bit HSL
    unsigned int transparency;   // 1: fully transparent texels (word 0) stay transparent; 2: per-texel alpha
    unsigned char materialkind;
    unsigned char field4;
    unsigned int field5;
    bool field6;
    unsigned char greyblend;     // weight/256 of the grey mixed into unlit face colours
    unsigned char brightness;    // unlit channels scaled by (256 + value)/256
    signed char scrollu;         // scroll speeds in 1/64 texture width per second
    signed char scrollv;
    bool omitted;
    bool dropfaces;
    bool field13;
    bool wrapu;                  // wrap horizontally (blur and addressing)
    bool wrapv;                  // wrap vertically
    unsigned char field16;
    bool field17;
    bool field18;
    unsigned int field19;

    // Stores the 19 values in field order, each narrowed to its field; booleans
    // are true when non-zero.
    void set(int averagehsl, int transparency, int materialkind, int field4, int field5, int field6, int greyblend,
             int brightness, int scrollu, int scrollv, int omitted, int dropfaces, int field13, int wrapu, int wrapv,
             int field16, int field17, int field18, int field19);
    // The same from an array of 19 values.
    void set(const int* v);
};

// One resident texture. The rasteriser addresses texel (u, v) as
// texels[u + 256 * v].
struct alignas(16) textureslot {
    texturemetrics metrics;
    __m128 scrolloffsetu;  // horizontal scroll offset in texels, four equal lanes
    __m128 scrolloffsetv;  // vertical scroll offset in texels, four equal lanes
    unsigned char queued;  // 1 while queued for the next scroll-offset update
    unsigned int* texels;  // first texel in the texel store
};

class alignas(16) texturecache {
public:
    static constexpr int kSlots = 200;
    static constexpr int kSize = 128;           // texels per side
    static constexpr int kStride = 256;         // texels per store row
    static constexpr unsigned char kNone = 255; // "not resident" / end of the LRU chain
    static constexpr unsigned int kStoreBytes = 100u * 128u * 256u * 4u;

    // Allocated 16-byte aligned. `idcount` ids have metrics; negative counts
    // throw IllegalArgumentException.
    static texturecache* create(toolkit* owner, int idcount);
    static void destroy(texturecache* cache);

    texturecache(toolkit* owner, int idcount);
    ~texturecache();

    // The slot of a resident texture, marked most recently used; a missing id
    // below the id count is requested from Java first. Null for id 65535, for
    // a texture Java cannot provide and for a missing id beyond the id count.
    textureslot* gettex(unsigned short id);
    // The id's metrics; null for 65535 and ids at or beyond the id count.
    texturemetrics* getmetrics(unsigned short id);
    // Stores a blurred copy of 128 x 128 ARGB pixels (row-major) with its metrics
    // in the least recently used slot.
    void upload_texture(unsigned short id, const int* pixels, const texturemetrics& m);
    // Writes the id's metrics; ArrayIndexOutOfBoundsException beyond the id count.
    void upload_texturemetrics(unsigned short id, const texturemetrics& m);
    // Computes the scroll offsets of the slots fetched since the last call.
    void service(int ms);

    // Copies 128 rows of 128 texels unchanged into a slot.
    static void copy_texture(const unsigned int* src, unsigned int* slotTexels);
    // Blurs `src` (128 x 128, 128 per row) into a slot (row stride 256): rows
    // first into a work image, then columns. Out-of-range neighbours wrap when
    // the pass's flag is set and are left out otherwise; with
    // transparentTexelsBlur false, transparent texels (word 0) stay 0 and are
    // left out as neighbours.
    static void copy_and_blur_texture(const unsigned int* src, unsigned int* slotTexels, bool wrapu, bool wrapv,
                                      bool transparentTexelsBlur);
    // Plain scalar reference of copy_and_blur_texture (same results bit for bit).
    static void copy_and_blur_texture_scalar(const unsigned int* src, unsigned int* slotTexels, bool wrapu,
                                             bool wrapv, bool transparentTexelsBlur);

    // Introspection for tests and tools.
    int idcount() const { return m_IdCount; }
    int slot_of(unsigned short id) const { return m_IdToSlot[id] == kNone ? -1 : m_IdToSlot[id]; }
    int lru_head() const { return m_LruHead; }
    int lru_tail() const { return m_LruTail; }
    int lru_next(int s) const { return m_Next[s] == kNone ? -1 : m_Next[s]; }
    int queued_count() const { return m_UpdateCount; }
    textureslot* slot(int s) { return &m_Slots[s]; }

private:
    void unlink_lru(int s);
    void append_lru(int s);
    void push_front_lru(int s);

    toolkit* m_Toolkit;
    unsigned int* m_Texels;  // 64-byte aligned store of kStoreBytes
    textureslot m_Slots[kSlots];
    texturemetrics* m_Metrics;
    int m_IdCount;
    unsigned char m_IdToSlot[65536];
    int m_SlotToId[kSlots];  // -1 = free
    unsigned char m_LruHead, m_LruTail;  // head: next victim; tail: most recently used
    unsigned char m_Next[256], m_Prev[256];
    unsigned char m_UpdateCount;
    unsigned char m_UpdateList[kSlots];
    std::mutex m_Lock;  // render threads fetch concurrently

    texturecache(const texturecache&) = delete;
    texturecache& operator=(const texturecache&) = delete;
};
