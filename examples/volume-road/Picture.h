#pragma once

#include "OutputFolder.h"

#include <kplib/foundation/KpDArray.h>

/// A grey picture, black to begin with.
struct Picture {
    long width, height;
    KpDArray<unsigned char> pixels;  // top row first

    Picture(long w, long h);

    /// Sets a pixel; one that lies outside is left out.
    void set(long column, long row, unsigned char grey)
    {
        if (column >= 0 && column < width && row >= 0 && row < height)
            pixels[row * width + column] = grey;
    }
};

KpResult writePng(const Picture& picture, const OutputFolder& out, const char* name);
