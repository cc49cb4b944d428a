#pragma once

#include "Image.h"

#include <vector>

class DcmPixelData;

/// The bytes of the compressed frame of a plane: its fragments, joined. Empty if they cannot be found.
std::vector<unsigned char> codestreamOf(DcmPixelData& pixelData, const Image& plane);

/// Bits of a sample in a JPEG or JPEG-LS codestream, by its frame header; 0 if it has none.
int jpegPrecision(const std::vector<unsigned char>& codestream);
