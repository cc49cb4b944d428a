#pragma once

#include "Image.h"

#include <memory>
#include <string>

class DcmFileFormat;
class DcmPixelData;

/// Reads planes of pixels, uncompressed or compressed, a frame in memory at a time.
///
/// The file and the frame of the last plane stay open, so that planes of one file are read without opening it again.
class PixelReader {
public:
    PixelReader();
    ~PixelReader();

    /// Opens the file of a plane; a failure names what is wrong with it.
    KpResult open(const Image& plane);
    /// The file that is open.
    DcmFileFormat& file() { return *file_; }

    /// The stored values of a plane in elements of storedType(): colours as red, green and blue.
    KpResult read(const Image& plane, void* stored);

private:
    KpResult decode(const Image& plane);
    KpResult decodeByToolkit(DcmPixelData& pixelData, const Image& plane);

    std::string path_;
    std::unique_ptr<DcmFileFormat> file_;
    bool hasFrame_ = false, isPlanar_ = false;
    unsigned long frame_ = 0;
    std::string photometric_;
    KpDArray<unsigned char> pixels_;  // the frame, in words of its allocated bits
};

/// Makes the decoders known to the DICOM toolkit; once, before the first file is read.
void registerDecoders();
