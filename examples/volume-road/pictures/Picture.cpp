#include "Picture.h"

#include "../volume/Volume.h"

#include <kplib/rawdata/KpRawData.h>

#include <png.h>
#include <string>

Picture::Picture(long w, long h) : width(w), height(h)
{
    pixels.resize(3 * w * h);
    marks.resize(static_cast<unsigned long>(w * h), KpBitfield::INIT_UNSET);
    KpRawData::memset({pixels.data(), KpPrimType::Byte}, 0, pixels.size());
}

double pixelSize(double finest, double width, double height)
{
    constexpr double mostSteps = 4095;  // pixels of a hundredth of a slice distance would fill the memory
    return std::max({finest, width / mostSteps, height / mostSteps});
}

KpResult writePng(const Picture& picture, const OutputFolder& out, const char* name)
{
    constexpr unsigned char markColour[] = {255, 176, 0};
    KpDArray<unsigned char> colours = picture.pixels;
    for (long i = 0; i < picture.width * picture.height; ++i) {
        if (picture.marks.test(static_cast<unsigned long>(i)))
            std::copy_n(markColour, 3, colours.data() + 3 * i);
    }
    png_image image{};
    image.version = PNG_IMAGE_VERSION;
    image.width = static_cast<png_uint_32>(picture.width);
    image.height = static_cast<png_uint_32>(picture.height);
    image.format = PNG_FORMAT_RGB;
    if (!png_image_write_to_file(&image, out.pathOf(name).c_str(), 0, colours.data(), 0, nullptr))
        return badInput("can't write %s: %s", name, image.message);
    return KpResult();
}
