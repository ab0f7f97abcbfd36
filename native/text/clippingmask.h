// Clipping masks: arbitrary-shaped stencils for 2D drawing, one horizontal
// span per row, and the placement rule that every masked consumer (masked
// clear and line, letters, sprites) applies through mask_placement.
//
// Placement: a mask placed at (maskX, maskY) covers, for each mask row r, the
// screen row maskY + r from x = maskX + starts[r] for lengths[r] pixels
// (lengths of 0 or less cover nothing). A masked drawing call first clips its
// object to the clip rectangle as the unmasked call would, then:
//   1. keeps only the rows [max(first clipped row, maskY),
//      min(end of clipped rows, maskY + row count));
//   2. on each such row draws only the intersection of the mask span with the
//      object's clipped horizontal range.
#pragma once

#include "util/memorymanager/sharedarray.h"

class clippingmask {
public:
    // Takes the two arrays as they are (already in pool memory). An empty
    // starts array means zero rows. lengths shorter than starts throws
    // IllegalArgumentException.
    clippingmask(int width, int height, const sharedarray<int>& starts, const sharedarray<int>& lengths);

    // Copies row data into `pool` first; a null starts (or lengths) pointer
    // stands for a missing array.
    clippingmask(memorymanager* pool, int width, int height, const int* starts, int nstarts, const int* lengths,
                 int nlengths);

    // Rows with both a start and a length (both arrays lose their elements
    // when their pool is released).
    int rows() const {
        const int s = m_Starts.count(), l = m_Lengths.count();
        return s < l ? s : l;
    }
    const int* starts() const { return m_Starts.data(); }
    const int* lengths() const { return m_Lengths.data(); }

    int m_Width;   // as given at creation; not used by drawing
    int m_Height;  // as given at creation; not used by drawing
    sharedarray<int> m_Starts;
    sharedarray<int> m_Lengths;

private:
    clippingmask(const clippingmask&) = delete;
    clippingmask& operator=(const clippingmask&) = delete;
};

// A mask placed at (maskX, maskY) over an object already clipped to columns
// [left, right) and rows [top, bottom). A null mask places nothing: all rows
// and the whole range are kept. Lives for one drawing call (it keeps the
// mask's element pointers, which stay put while nothing allocates in the pool).
class mask_placement {
public:
    mask_placement(const clippingmask* mask, int maskX, int maskY, int left, int top, int right, int bottom)
        : m_Masked(mask != nullptr), m_Left(left), m_Right(right) {
        if (!mask) {
            m_Starts = m_Lengths = nullptr;
            m_MaskX = m_MaskY = 0;
            m_First = top;
            m_End = bottom;
            return;
        }
        m_Starts = mask->starts();
        m_Lengths = mask->lengths();
        m_MaskX = maskX;
        m_MaskY = maskY;
        long long first = top > maskY ? top : maskY;
        long long end = (long long)maskY + mask->rows();
        if (end > bottom) end = bottom;
        if (end < first) end = first;
        m_First = int(first);
        m_End = int(end);
    }

    // Rows to visit: [first_row(), end_row()).
    int first_row() const { return m_First; }
    int end_row() const { return m_End; }

    // The drawable part [x0, x1) of screen row y: the mask's span intersected
    // with the object's range. False when it is empty or y is not a kept row.
    bool span(int y, int& x0, int& x1) const {
        if (y < m_First || y >= m_End) return false;
        long long a = m_Left, b = m_Right;
        if (m_Masked) {
            const long long r = y - m_MaskY;
            const long long n = m_Lengths[r];
            if (n <= 0) return false;
            const long long sx = m_MaskX + m_Starts[r];
            if (sx > a) a = sx;
            if (sx + n < b) b = sx + n;
        }
        if (a >= b) return false;
        x0 = int(a);
        x1 = int(b);
        return true;
    }

private:
    bool m_Masked;
    const int* m_Starts;
    const int* m_Lengths;
    long long m_MaskX, m_MaskY;
    int m_Left, m_Right, m_First, m_End;
};
