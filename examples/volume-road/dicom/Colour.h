#pragma once

#include "Image.h"

#include <string>

class DcmItem;

/// The pixels of a colour plane as red, green and blue bytes. `photometric` and `isPlanar` describe `pixels`, a whole
/// frame. A failure for colour models that are not read.
KpResult toColours(DcmItem& data, const Image& plane, const std::string& photometric, bool isPlanar,
                   const unsigned char* pixels, unsigned char* rgb);
