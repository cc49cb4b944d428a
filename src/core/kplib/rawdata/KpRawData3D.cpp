#include <kplib/rawdata/KpRawData3D.h>

#include <kplib/cpu/ByteCount.h>
#include <kplib/foundation/KpMemory.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData2D.h>
#include <kplib/rawdata/detail/PlaneCopy.h>

#include <climits>
#include <utility>

using namespace kplib::detail;

namespace {

// The axes along a row, from row to row and from slice to slice.
struct Axes {
    int row, column, across;
};

Axes axesOf(int orientation)
{
    constexpr Axes axes[] = {{1, 2, 0}, {0, 2, 1}, {0, 1, 2}};
    return axes[orientation == 1 || orientation == 2 ? orientation : 0];
}

// Voxels from one to the next along `axis`.
long step(const std::int32_t* dims, int axis)
{
    return axis == 0 ? 1L : axis == 1 ? long{dims[0]} : long{dims[0]} * dims[1];
}

Plane planeOf(const KpRawData3D& block, int orientation, int k)
{
    const Axes axes = axesOf(orientation);
    const long voxel = block.bytesPerVoxel();
    return {static_cast<char*>(block.data()) + k * step(block.dims(), axes.across) * voxel,
            step(block.dims(), axes.row) * voxel, step(block.dims(), axes.column) * voxel};
}

PlaneShape shapeOf(const KpRawData3D& block, int orientation)
{
    const Axes axes = axesOf(orientation);
    return {block.dims()[axes.row], block.dims()[axes.column], block.bytesPerVoxel()};
}

// Whether the strides are what views have room for; an error in the log if not.
bool hasIntStrides(const Plane& plane)
{
    const bool fits = plane.pixelStride <= INT_MAX && plane.rowStride <= INT_MAX;
    if (!fits)
        getTheLogInstance().errorf("KpRawData3D: the strides of a slice are 2147483648 bytes or more\n");
    return fits;
}

bool isOrientation(int number)
{
    return number >= 0 && number <= 2;
}

}  // namespace

void KpRawData3D::init(int nx, int ny, int nz, int bytesPerVoxel)
{
    init(nx, ny, nz, bytesPerVoxel, nullptr);
    ownedData_ = data_ = kpmalloc(static_cast<unsigned long>(byteCount({nx, ny, nz, bytesPerVoxel})));
}

void KpRawData3D::init(int nx, int ny, int nz, int bytesPerVoxel, void* data)
{
    cleanup();
    dims_[0] = nx;
    dims_[1] = ny;
    dims_[2] = nz;
    bytesPerVoxel_ = bytesPerVoxel;
    data_ = data;
}

void KpRawData3D::cleanup()
{
    kpfree(ownedData_);
    ownedData_ = nullptr;
}

void KpRawData3D::swapDataPtr(void*& p)
{
    std::swap(ownedData_, p);
    data_ = ownedData_;
}

void KpRawData3D::commit(int nx, int ny, int nz, int bytesPerVoxel, void* data)
{
    init(nx, ny, nz, bytesPerVoxel, data);
    ownedData_ = data;
}

long KpRawData3D::getOffset(int i, int j, int k, int orientation) const
{
    const Axes axes = axesOf(orientation);
    return i * step(dims_, axes.row) + j * step(dims_, axes.column) + k * step(dims_, axes.across);
}

void KpRawData3D::getDims(int orientation, int& d0, int& d1, int& d2) const
{
    const Axes axes = axesOf(orientation);
    d0 = dims_[axes.row];
    d1 = dims_[axes.column];
    d2 = dims_[axes.across];
}

void KpRawData3D::accessSlice(int orientation, int k, void*& p, int& stride0, int& stride1) const
{
    Plane plane = planeOf(*this, orientation, k);
    if (!hasIntStrides(plane))
        plane = {};
    p = plane.data;
    stride0 = static_cast<int>(plane.pixelStride);
    stride1 = static_cast<int>(plane.rowStride);
}

void KpRawData3D::getSlice(int orientation, int k, KpRawData2D& out, int copy) const
{
    if (!isOrientation(orientation))
        return;
    const Plane plane = planeOf(*this, orientation, k);
    const PlaneShape shape = shapeOf(*this, orientation);
    if (copy != 0)
        copyPlane(densePlane(out.data(), shape), plane, shape);
    else if (hasIntStrides(plane))
        out.init(static_cast<int>(shape.width), static_cast<int>(shape.height), bytesPerVoxel_,
                 static_cast<int>(plane.pixelStride), static_cast<int>(plane.rowStride), plane.data);
    else
        out.init(0, 0, bytesPerVoxel_, nullptr);
}

void KpRawData3D::putSlice(int orientation, int k, const KpRawData2D& slice)
{
    if (!isOrientation(orientation))
        return;
    const PlaneShape shape = shapeOf(*this, orientation);
    copyPlane(planeOf(*this, orientation, k), densePlane(slice.data(), shape), shape);
}
