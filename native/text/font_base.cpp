#include "text/font_base.h"

#include <cstring>

font_base::font_base(memorymanager* pool, unsigned int glyphcount) : m_Pool(pool), m_Glyphs(glyphcount) {}

void font_base::set_glyph(int index, const unsigned char* bytes, int length) {
    sharedarray<unsigned char>& slot = m_Glyphs.at(index);
    if (!bytes) {
        slot.reset();
        return;
    }
    if (length < 0) throw new IllegalArgumentException();
    sharedarray<unsigned char> copy(m_Pool, unsigned(length));
    if (length) std::memcpy(copy.data(), bytes, size_t(length));
    slot = copy;
}

void font_base::validate() const {
    int n = m_Glyphs.size();
    if (m_Widths.count() < n) n = m_Widths.count();
    if (m_Heights.count() < n) n = m_Heights.count();
    for (int i = 0; i < n; ++i) {
        const long long w = m_Widths[i], h = m_Heights[i];
        if (w > 0 && h > 0 && (long long)m_Glyphs[i].count() < w * h)
            throw new IllegalArgumentException("glyph bitmap shorter than width x height");
    }
}

bool font_base::find_glyph(short index, glyph_view& v) const {
    const int i = index;
    if (i < 0 || i >= m_Glyphs.size() || i >= m_Widths.count() || i >= m_Heights.count() ||
        i >= m_XOffsets.count() || i >= m_YOffsets.count())
        return false;
    v.width = m_Widths[i];
    v.height = m_Heights[i];
    v.xoffset = m_XOffsets[i];
    v.yoffset = m_YOffsets[i];
    if (v.width <= 0 || v.height <= 0) return false;
    const sharedarray<unsigned char>& bits = m_Glyphs[i];
    if ((long long)bits.count() < (long long)v.width * v.height) return false;
    v.bits = bits.data();
    return true;
}
