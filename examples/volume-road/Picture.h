#pragma once

#include "OutputFolder.h"

#include <kplib/foundation/KpDArray.h>
#include <kplib/volume/KpBitfield.h>

#include <cmath>

/// A grey picture, black to begin with, and marks on it that are shown in colour.
struct Picture {
    long width, height;
    KpDArray<unsigned char> pixels;  // top row first
    KpBitfield marks;                // one bit a pixel

    Picture(long w, long h);

    /// Sets a pixel, unmarked; one that lies outside is left out.
    void set(long column, long row, unsigned char grey)
    {
        if (column < 0 || column >= width || row < 0 || row >= height)
            return;
        pixels[row * width + column] = grey;
        marks.unset(static_cast<unsigned long>(row * width + column));
    }
    void mark(long column, long row) { marks.set(static_cast<unsigned long>(row * width + column)); }
};

/// The size of square pixels that show `finest` mm, or what makes a picture of so many mm as large as pictures get.
double pixelSize(double finest, double width, double height);

/// How many pixels reach over `extent` mm, the middles of the first and the last at its ends.
inline long pixelsFor(double extent, double pixel)
{
    return std::lround(extent / pixel) + 1;
}

KpResult writePng(const Picture& picture, const OutputFolder& out, const char* name);
