#pragma once

#include "Image.h"

// The bits of a decoded frame as numbers, for planes without a problem.

/// The element type that holds all values of a plane.
KpPrimType storedType(const PixelFormat& format);

/// The stored values of a plane of whole bytes and one sample a pixel, cut out of their words with their sign, in
/// elements of storedType(). `pixels` is the whole frame, aligned for its words.
void copyValues(const unsigned char* pixels, const Image& plane, void* stored);
