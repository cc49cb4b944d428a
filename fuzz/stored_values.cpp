#include "Fuzz.h"

#include <volume-road/dicom/StoredValues.h>
#include <volume-road/pictures/Window.h>

#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <vector>

// Any bytes as the pixels of a plane in any sound format: the values are those that a walk over the single bits gives,
// and any window shows them.

namespace {

PixelFormat formatOf(Input& input)
{
    PixelFormat format;
    format.bitsAllocated = 8 << input.number<std::uint8_t>() % 3;
    format.bitsStored = 1 + input.number<std::uint8_t>() % format.bitsAllocated;
    format.highBit =
        format.bitsStored - 1 + input.number<std::uint8_t>() % (format.bitsAllocated - format.bitsStored + 1);
    format.isSigned = input.number<std::uint8_t>() % 2;
    return format;
}

Image planeOf(Input& input)
{
    Image plane;
    plane.format = formatOf(input);
    plane.columns = 1 + input.number<std::uint8_t>() % 16;
    plane.rows = 1 + input.number<std::uint8_t>() % 16;
    plane.tilesAcross = 1 + input.number<std::uint8_t>() % 4;
    plane.tile = plane.tilesAcross == 1 ? -1 : input.number<std::uint8_t>() % (plane.tilesAcross * plane.tilesAcross);
    return plane;
}

/// The value at a pixel of the frame, bit by bit.
double valueAt(const std::vector<unsigned char>& frame, const PixelFormat& format, long pixel)
{
    std::int64_t value = 0;
    for (int i = 0; i < format.bitsStored; ++i) {
        const long bit = pixel * format.bitsAllocated + format.highBit + 1 - format.bitsStored + i;
        if (frame[static_cast<std::size_t>(bit / 8)] >> bit % 8 & 1)
            value += std::int64_t{format.isSigned && i == format.bitsStored - 1 ? -1 : 1} * (std::int64_t{1} << i);
    }
    return static_cast<double>(value);
}

void checkValues(Volume& volume, const Image& plane, const std::vector<unsigned char>& frame)
{
    const long across = plane.tilesAcross, tile = plane.tile < 0 ? 0 : plane.tile;
    std::vector<double> values(static_cast<std::size_t>(volume.count()));
    KpRawData::memcpy({values.data(), KpPrimType::Double}, volume.voxels(), volume.count());
    for (long i = 0; i < volume.count(); ++i) {
        const long x = tile % across * plane.columns + i % plane.columns;
        const long y = tile / across * plane.rows + i / plane.columns;
        check(values[static_cast<std::size_t>(i)] == valueAt(frame, plane.format, y * plane.columns * across + x));
    }
}

Window windowOf(Input& input)
{
    Window window;
    window.center = input.number<float>();
    window.width = input.number<float>();
    window.function = static_cast<Window::Function>(input.number<std::uint8_t>() % 3);
    window.isInverted = input.number<std::uint8_t>() % 2 != 0;
    return window;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    Input input(data, size);
    const Image plane = planeOf(input);
    const Window window = windowOf(input);
    const int pixels = plane.rows * plane.columns * plane.tilesAcross * plane.tilesAcross;
    std::vector<unsigned char> frame(static_cast<std::size_t>(pixels * plane.format.bitsAllocated / 8));
    if (const std::string bytes = input.rest(); !bytes.empty()) {  // a short input repeats
        for (std::size_t i = 0; i < frame.size(); ++i)
            frame[i] = static_cast<unsigned char>(bytes[i % bytes.size()]);
    }

    Volume volume, shown;
    volume.dims = {plane.columns, plane.rows, 1};
    volume.type = storedType(plane.format);
    volume.allocate();
    copyValues(frame.data(), plane, volume.bytes.data());
    checkValues(volume, plane, frame);
    display(volume, window, shown);
    check(shown.bytes.size() == volume.count());
    return 0;
}
