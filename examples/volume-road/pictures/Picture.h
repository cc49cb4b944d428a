#pragma once

#include "../commands/OutputFolder.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/volume/KpBitfield.h>

#include <algorithm>
#include <cmath>

/// A picture in colour, black at first, and marks on it that are drawn in a colour of their own.
struct Picture {
    long width, height;
    KpDArray<unsigned char> pixels;  // red, green, blue; top row first
    KpBitfield marks;                // one bit a pixel

    Picture(long w, long h);

    unsigned char* at(long column, long row) { return pixels.data() + 3 * (row * width + column); }
    /// Sets a pixel to grey, unmarked; one that lies outside is left out.
    void set(long column, long row, unsigned char grey)
    {
        if (column < 0 || column >= width || row < 0 || row >= height)
            return;
        std::fill_n(at(column, row), 3, grey);
        marks.unset(static_cast<unsigned long>(row * width + column));
    }
    void mark(long column, long row) { marks.set(static_cast<unsigned long>(row * width + column)); }
};

/// The size of square pixels that show `finest` mm, or the size with which a picture of so many mm reaches the largest
/// number of pixels.
double pixelSize(double finest, double width, double height);

/// How many pixels reach over `extent` mm, the middles of the first and the last at its ends.
inline long pixelsFor(double extent, double pixel)
{
    return std::lround(extent / pixel) + 1;
}

KpResult writePng(const Picture& picture, const OutputFolder& out, const char* name);
