#pragma once

namespace kplib::detail {

// Where pixels lie: the first one, and the bytes from one to the next in a row and from row to row.
struct Plane {
    void* data;
    long pixelStride, rowStride;
};

struct PlaneShape {
    long width, height, bytesPerPixel;
};

// Without gaps.
inline Plane densePlane(void* data, const PlaneShape& shape)
{
    return {data, shape.bytesPerPixel, shape.width * shape.bytesPerPixel};
}

// Copies the pixels, in blocks as large as both sides allow; nothing if there are none or if either side has no
// memory. Planes that overlap have to be the same.
void copyPlane(const Plane& to, const Plane& from, const PlaneShape& shape);

// Fills the pixels with zeros; the bytes between them stay.
void clearPlane(const Plane& plane, const PlaneShape& shape);

}  // namespace kplib::detail
