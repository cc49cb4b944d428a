#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <cstdint>

/// A block of voxels without gaps, x fastest, either an owner of its memory or a view on memory
/// that is owned elsewhere.
///
/// Voxels are opaque bytes of a given size. Slices have an orientation: 0 is the plane of constant
/// x with rows along y, 1 that of constant y and 2 that of constant z, both with rows along x.
/// Positions and sizes are not checked. The object cannot be copied: use init() for a second
/// block.
///
/// Errors: exhausted memory throws KpMemoryException; the object then holds no memory.
///
/// Threads: one thread may change it, or any number read it.  Memory: by kpmalloc.
class KPLIB_API KpRawData3D {
public:
    /// Empty: sizes and pointers are 0.
    KpRawData3D() = default;
    /// As init().
    KpRawData3D(int nx, int ny, int nz, int bytesPerVoxel) { init(nx, ny, nz, bytesPerVoxel); }
    /// As init().
    KpRawData3D(int nx, int ny, int nz, int bytesPerVoxel, void* data) { init(nx, ny, nz, bytesPerVoxel, data); }
    KpRawData3D(const KpRawData3D&) = delete;
    KpRawData3D& operator=(const KpRawData3D&) = delete;
    ~KpRawData3D() { cleanup(); }

    /// Makes this the owner of voxels that are not initialised, also if there are none.
    void init(int nx, int ny, int nz, int bytesPerVoxel);
    /// A view.
    void init(int nx, int ny, int nz, int bytesPerVoxel, void* data);

    /// Frees the block of an owner. data() keeps its value and must not be used.
    void cleanup();

    /// Exchanges the owned block for `p`, a block of kpmalloc or null. data() becomes the newly
    /// owned block.
    void swapDataPtr(void*& p);

    /// Makes this the owner of `data`, a block of kpmalloc.
    void commit(int nx, int ny, int nz, int bytesPerVoxel, void* data);

    /// Number, not byte, of the voxel at (`i`, `j`) within slice `k`. Other orientations than 1 and 2 count as 0.
    long getOffset(int i, int j, int k, int orientation) const;

    /// Width, height and number of the slices. Other orientations than 1 and 2 count as 0.
    void getDims(int* dims, int orientation) const { getDims(orientation, dims[0], dims[1], dims[2]); }
    /// The same into three numbers.
    void getDims(int orientation, int& d0, int& d1, int& d2) const;

    /// Sets `p` to the first voxel of slice `k`, and the strides to the bytes from voxel to voxel
    /// in a row and from row to row. Other orientations than 1 and 2 count as 0. Strides have 32
    /// bits: if one is 2^31 bytes or more, sets null and zeros and logs an error; use getSlice()
    /// and putSlice() to copy such slices.
    void accessSlice(int orientation, int k, void*& p, int& stride0, int& stride1) const;

    /// Makes `out` a view on slice `k`, without pixels or data if accessSlice() refuses it. With
    /// `copy`, fills the memory of `out`, without gaps, regardless of its sizes and strides. Does
    /// nothing for other orientations than 0, 1 and 2.
    void getSlice(int orientation, int k, KpRawData2D& out, int copy) const;

    /// Overwrites slice `k` by the pixels of `slice`, read without gaps, regardless of its sizes
    /// and strides. Does nothing for other orientations than 0, 1 and 2.
    void putSlice(int orientation, int k, const KpRawData2D& slice);

    /// Voxels along x, y and z.
    const std::int32_t* dims() const { return dims_; }
    /// Size of a voxel.
    int bytesPerVoxel() const { return bytesPerVoxel_; }
    /// The first voxel; a view hands out its memory for writing, too.
    void* data() const { return data_; }
    /// The block of an owner, null for a view.
    void* ownedData() const { return ownedData_; }

private:
    std::int32_t dims_[3] = {0, 0, 0};
    std::int32_t bytesPerVoxel_ = 0;
    void* data_ = nullptr;
    void* ownedData_ = nullptr;  // null or data_
};
