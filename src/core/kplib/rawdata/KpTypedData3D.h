#pragma once

#include <kplib/rawdata/KpRawData3D.h>
#include <kplib/rawdata/KpTypedPointer.h>

#include <cstdint>

/// A KpRawData3D whose voxels are a number of components of one element type. The size of a voxel
/// follows from the two. It cannot be copied.
class KPLIB_API KpTypedData3D : public KpRawData3D {
public:
    /// Empty: no components, of bytes.
    KpTypedData3D() = default;
    /// As init().
    KpTypedData3D(int nx, int ny, int nz, KpPrimType type, int nDataVar) { init(nx, ny, nz, type, nDataVar); }
    /// @{
    /// As init().
    KpTypedData3D(const int* dims, KpPrimType type, int nDataVar) { init(dims[0], dims[1], dims[2], type, nDataVar); }
    KpTypedData3D(int nx, int ny, int nz, KpTypedPointer p, int nDataVar) { init(nx, ny, nz, p, nDataVar); }
    KpTypedData3D(const int* dims, KpTypedPointer p, int nDataVar) { init(dims[0], dims[1], dims[2], p, nDataVar); }
    /// @}

    /// An owner of voxels that are not set to anything.
    void init(int nx, int ny, int nz, KpPrimType type, int nDataVar);
    /// A view.
    void init(int nx, int ny, int nz, KpTypedPointer p, int nDataVar);

    using KpRawData3D::getSlice;
    /// As KpRawData3D::getSlice(). `out` also receives the components and the type of this block,
    /// even if it receives nothing else.
    void getSlice(int orientation, int k, KpTypedData2D& out, int copy) const;

    /// Components a voxel.
    int nDataVar() const { return nDataVar_; }
    /// Type of the components.
    KpPrimType primType() const { return primType_; }

private:
    int setElements(KpPrimType type, int nDataVar);

    std::int32_t nDataVar_ = 0;
    KpPrimType primType_;
};
