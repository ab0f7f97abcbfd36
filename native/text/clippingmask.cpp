#include "text/clippingmask.h"

#include <cstring>

clippingmask::clippingmask(int width, int height, const sharedarray<int>& starts, const sharedarray<int>& lengths)
    : m_Width(width), m_Height(height), m_Starts(starts), m_Lengths(lengths) {
    if (m_Lengths.count() < m_Starts.count())
        throw new IllegalArgumentException("clipping mask has fewer lengths than starts");
}

static sharedarray<int> pool_copy(memorymanager* pool, const int* src, int n) {
    if (!src) return sharedarray<int>();
    if (n < 0) throw new IllegalArgumentException();
    sharedarray<int> out(pool, unsigned(n));
    if (n) std::memcpy(out.data(), src, size_t(n) * sizeof(int));
    return out;
}

clippingmask::clippingmask(memorymanager* pool, int width, int height, const int* starts, int nstarts,
                           const int* lengths, int nlengths)
    : m_Width(width), m_Height(height) {
    if (!starts) nstarts = 0;
    if (!lengths) nlengths = 0;
    if (nlengths < nstarts) throw new IllegalArgumentException("clipping mask has fewer lengths than starts");
    m_Starts = pool_copy(pool, starts, nstarts);
    m_Lengths = pool_copy(pool, lengths, nlengths);
}
