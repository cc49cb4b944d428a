#include <kplib/rawdata/KpRawData2D.h>

#include <kplib/cpu/ByteCount.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/detail/PlaneCopy.h>

#include <cstdint>
#include <cstdlib>

using namespace kplib::detail;

namespace {

PlaneShape shapeOf(const KpRawData2D& image)
{
    return {image.dims()[0], image.dims()[1], image.bytesPerPixel()};
}

Plane planeOf(const KpRawData2D& image)
{
    return {image.data(), image.pixelStride(), image.rowStride()};
}

long bytesOf(const PlaneShape& shape)
{
    return byteCount({shape.width, shape.height, shape.bytesPerPixel});
}

// A block for the pixels without gaps, one also for none; null if there is no memory.
void* allocated(const PlaneShape& shape)
{
    const long bytes = bytesOf(shape);
    return std::malloc(bytes == 0 ? 1 : static_cast<size_t>(bytes));
}

}  // namespace

KpRawData2D& KpRawData2D::operator=(const KpRawData2D& other)
{
    if (this == &other)
        return *this;
    init(other.dims_[0], other.dims_[1], other.bytesPerPixel_, other.pixelStride_, other.rowStride_, other.data_);
    if (other.ownedData_) {
        const PlaneShape shape = shapeOf(other);
        ownedData_ = data_ = allocated(shape);
        copyPlane(densePlane(data_, shape), densePlane(other.ownedData_, shape), shape);
    }
    return *this;
}

void KpRawData2D::init(int w, int h, int bytesPerPixel)
{
    cleanup();
    if (!setDenseShape(w, h, bytesPerPixel))
        data_ = nullptr;
    else if (bytesOf(shapeOf(*this)) != 0)
        ownedData_ = data_ = allocated(shapeOf(*this));
}

void KpRawData2D::init(int w, int h, int bytesPerPixel, void* data)
{
    cleanup();
    data_ = setDenseShape(w, h, bytesPerPixel) ? data : nullptr;
}

void KpRawData2D::init(int w, int h, int bytesPerPixel, int rowStride, void* data)
{
    init(w, h, bytesPerPixel, bytesPerPixel, rowStride, data);
}

void KpRawData2D::init(int w, int h, int bytesPerPixel, int pixelStride, int rowStride, void* data)
{
    cleanup();
    dims_[0] = w;
    dims_[1] = h;
    bytesPerPixel_ = bytesPerPixel;
    pixelStride_ = pixelStride;
    rowStride_ = rowStride;
    data_ = data;
}

void KpRawData2D::cleanup()
{
    std::free(ownedData_);
    ownedData_ = nullptr;
}

void KpRawData2D::commit(int w, int h, int bytesPerPixel, void* data)
{
    init(w, h, bytesPerPixel, data);
    ownedData_ = data;
    if (!data_)
        cleanup();
}

bool KpRawData2D::copyData(const KpRawData2D& from)
{
    if (dims_[0] != from.dims_[0] || dims_[1] != from.dims_[1] || bytesPerPixel_ != from.bytesPerPixel_)
        return false;
    copyPlane(planeOf(*this), planeOf(from), shapeOf(*this));
    return true;
}

void KpRawData2D::makeLocal()
{
    if (ownedData_)
        return;
    const PlaneShape shape = shapeOf(*this);
    void* const block = allocated(shape);
    copyPlane(densePlane(block, shape), planeOf(*this), shape);
    commit(dims_[0], dims_[1], bytesPerPixel_, block);
}

void KpRawData2D::clear()
{
    clearPlane(planeOf(*this), shapeOf(*this));
}

// Sizes and the strides of pixels without gaps. False, with an error in the log, if the rows are too long for them.
bool KpRawData2D::setDenseShape(int w, int h, int bytesPerPixel)
{
    const std::int64_t rowBytes = std::int64_t{w} * bytesPerPixel;
    const bool fits = rowBytes <= INT32_MAX || h < 1;
    dims_[0] = w;
    dims_[1] = h;
    bytesPerPixel_ = bytesPerPixel;
    pixelStride_ = bytesPerPixel;
    rowStride_ = fits ? static_cast<std::int32_t>(rowBytes) : 0;
    if (!fits)
        getTheLogInstance().errorf("KpRawData2D: rows of %lld bytes are too long\n", static_cast<long long>(rowBytes));
    return fits;
}
