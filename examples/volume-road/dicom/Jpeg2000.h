#pragma once

#include "Image.h"

#include <string>

class DcmPixelData;

/// Whether a transfer syntax of this UID holds JPEG 2000 codestreams.
bool isJpeg2000(const std::string& syntax);

/// Decodes one frame into words of its allocated bits, colours interleaved as red, green and blue.
KpResult decodeJpeg2000(DcmPixelData& pixelData, const Image& plane, unsigned char* pixels);
