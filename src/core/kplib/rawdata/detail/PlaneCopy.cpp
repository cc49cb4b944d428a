#include <kplib/rawdata/detail/PlaneCopy.h>

#include <cstddef>
#include <cstring>

namespace kplib::detail {
namespace {

using PixelLoop = void(char* to, long toStride, const char* from, long fromStride, long n, std::size_t width);

// The common widths are compiled in: a block copy of variable size costs more than the pixel. 0:
// any width.
template <std::size_t Width>
void copyPixels(char* to, long toStride, const char* from, long fromStride, long n, std::size_t width)
{
    for (long i = 0; i < n; ++i)
        std::memmove(to + i * toStride, from + i * fromStride, Width > 0 ? Width : width);
}

PixelLoop* pixelLoop(long width)
{
    switch (width) {
    case 1:
        return copyPixels<1>;
    case 2:
        return copyPixels<2>;
    case 4:
        return copyPixels<4>;
    case 8:
        return copyPixels<8>;
    default:
        return copyPixels<0>;
    }
}

bool isEmpty(const PlaneShape& shape)
{
    return shape.width < 1 || shape.height < 1 || shape.bytesPerPixel < 1;
}

// Calls `block(offset in a, offset in b, bytes)` for each run that has no gaps in either plane.
template <typename Block>
void eachBlock(const Plane& a, const Plane& b, const PlaneShape& shape, Block block)
{
    const long rowBytes = shape.width * shape.bytesPerPixel;
    if (a.rowStride == rowBytes && b.rowStride == rowBytes) {
        block(0L, 0L, static_cast<std::size_t>(rowBytes * shape.height));
        return;
    }
    for (long y = 0; y < shape.height; ++y)
        block(y * a.rowStride, y * b.rowStride, static_cast<std::size_t>(rowBytes));
}

}  // namespace

void copyPlane(const Plane& to, const Plane& from, const PlaneShape& shape)
{
    if (isEmpty(shape) || !to.data || !from.data)
        return;
    auto* const dst = static_cast<char*>(to.data);
    const auto* const src = static_cast<const char*>(from.data);
    if (to.pixelStride == shape.bytesPerPixel && from.pixelStride == shape.bytesPerPixel) {
        eachBlock(to, from, shape, [=](long d, long s, std::size_t n) { std::memmove(dst + d, src + s, n); });
        return;
    }
    PixelLoop* const loop = pixelLoop(shape.bytesPerPixel);
    for (long y = 0; y < shape.height; ++y)
        loop(dst + y * to.rowStride, to.pixelStride, src + y * from.rowStride, from.pixelStride, shape.width,
             static_cast<std::size_t>(shape.bytesPerPixel));
}

void clearPlane(const Plane& plane, const PlaneShape& shape)
{
    if (isEmpty(shape) || !plane.data)
        return;
    auto* const data = static_cast<char*>(plane.data);
    if (plane.pixelStride == shape.bytesPerPixel) {
        eachBlock(plane, plane, shape, [=](long at, long, std::size_t n) { std::memset(data + at, 0, n); });
        return;
    }
    for (long y = 0; y < shape.height; ++y)
        for (long x = 0; x < shape.width; ++x)
            std::memset(data + y * plane.rowStride + x * plane.pixelStride, 0,
                        static_cast<std::size_t>(shape.bytesPerPixel));
}

}  // namespace kplib::detail
