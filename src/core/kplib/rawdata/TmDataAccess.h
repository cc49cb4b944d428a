#pragma once

#include <kplib/foundation/Kp128.h>
#include <kplib/foundation/KpAllocator.h>
#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>
#include <kplib/foundation/KpHandableThreaded.h>
#include <kplib/foundation/KpPrimType.h>
#include <kplib/geometry/KpBox3i.h>
#include <kplib/geometry/KpVec3l.h>
#include <kplib/log/KpResult.h>

#include <cstddef>
#include <cstdint>

/// A volume in memory: sizes, element type, components, strides and the memory itself. It is
/// passed as KpHandle<TmDataAccess>.
///
///     KpHandle<TmDataAccess> volume(new TmDataAccess({4L, 3L, 2L}, KpPrimType::Short, 1,
///                                                    KpAllocator(KpAllocator::AllocatorMalloc)));
///     if (volume->hasData())
///         *static_cast<short*>(volume->dataPtr(1, 2, 1)) = 42;
///     std::printf("%ld bytes, stride %ld\n", volume->size(), volume->strides()[2]);
///     // prints: 48 bytes, stride 24
///
/// The memory is one block (linear; strides()[2] is above 0) or one block for each slice (sliced;
/// strides()[2] is 0). Voxel (x, y, z) is at the address of its slice + x * strides()[0] + y *
/// strides()[1], in bytes. Coordinates are not checked.
///
/// Ownership: the object frees its blocks by its allocator. With an allocator that frees nothing
/// it is a view, which is valid as long as the memory.
///
/// Threads: handles may be copied and released on any thread; all else has no lock. The fields of
/// a lock on a region are only stored here; their users define their meaning.
class KPLIB_API TmDataAccess : public KpHandableThreaded {
public:
    /// Called first in the destructor. `data` is that of setDeleteCallback().
    using DeleteCallback = void (*)(TmDataAccess* object, void* data);

    /// Empty: all sizes are 0; frees with free().
    TmDataAccess() = default;
    /// Allocates one block of size() bytes by `allocator`, not initialised. If that fails, the
    /// object has no data.
    TmDataAccess(const KpVec3l& dims, KpPrimType type, int nDataVar, KpAllocator allocator);

    // Strides of 0 stand for data without gaps, except that of z, which stays 0 for two or more
    // slices.

    /// Describes one block, or no data if it is null. The object owns the memory if `allocator`
    /// frees it.
    TmDataAccess(const KpVec3l& dims, const KpVec3l& strides, void* data, KpPrimType type, int nDataVar,
                 KpAllocator allocator);
    /// Without data.
    TmDataAccess(const KpVec3l& dims, const KpVec3l& strides, std::nullptr_t, KpPrimType type, int nDataVar,
                 KpAllocator allocator) :
        TmDataAccess(dims, strides, static_cast<void*>(nullptr), type, nDataVar, allocator)
    {
    }
    /// Describes one block for each slice, `dims`[2] of them in the order of z, or no data if
    /// `data` is null.
    TmDataAccess(const KpVec3l& dims, const KpVec3l& strides, void* const* data, KpPrimType type, int nDataVar,
                 KpAllocator allocator);

    TmDataAccess(const TmDataAccess&) = delete;
    TmDataAccess& operator=(const TmDataAccess&) = delete;
    /// Calls the delete callback, then dataRelease(). An exception from either ends the process.
    ~TmDataAccess() override;

    /// Frees the memory and keeps the description.
    void dataRelease();

    /// What the destructor runs first; null for nothing.
    void setDeleteCallback(DeleteCallback callback, void* data);
    void setPrimType(KpPrimType type) { primType_ = type; }  ///< converts nothing
    /// Replaces what dataRelease() frees with.
    void setAllocator(KpAllocator allocator) { allocator_ = allocator; }

    /// Voxels along x, y and z.
    KpVec3l dims() const { return dims_; }
    /// Type of the components.
    KpPrimType primType() const { return primType_; }
    /// Components a voxel.
    int nDataVar() const { return nDataVar_; }
    /// Bytes from one voxel to the next along x, y and z.
    KpVec3l strides() const { return strides_; }
    /// What dataRelease() frees with.
    KpAllocator allocator() const { return allocator_; }

    /// Bytes of all voxels, without gaps; the largest number where that is out of range.
    long size() const;
    /// Whether sizes, strides and the number of blocks are consistent.
    bool isValid() const;
    /// Whether the memory is one block.
    bool isLinear() const { return strides_[2] > 0; }
    /// Whether there is memory.
    bool hasData() const { return dataPtrs_.size() > 0; }
    /// Whether there are no gaps between voxels, rows and slices; never for sliced data.
    bool isContiguous() const;

    // Addresses; they need data.

    /// Slice `z`.
    void* dataPtr(long z) const
    {
        KPLIB_CHECK(hasData(), "TmDataAccess: dataPtr() without data");
        return isLinear() ? static_cast<char*>(dataPtrs_[0]) + strides_[2] * z : dataPtrs_[z];
    }
    /// Voxel (`x`, `y`, `z`).
    void* dataPtr(long x, long y, long z) const
    {
        return static_cast<char*>(dataPtr(z)) + x * strides_[0] + y * strides_[1];
    }
    /// The blocks.
    void* const* dataPtrs() const { return dataPtrs_.data(); }

    /// Calls `run(const void* address, unsigned long bytes)` for the voxels from the first to the last, in runs as long
    /// as the layout allows; voxels of a row are assumed to be dense. Makes no call without data.
    template <typename Run>
    void eachVoxelRun(Run run) const;

    /// Makes `out` a view on the voxels of `box`, both bounds inside; null without data. The
    /// bounds are not checked, and the view does not keep this object alive. One slice of sliced
    /// data gives a linear view.
    void subBox(KpHandle<TmDataAccess>& out, const KpBox3i& box) const;

    /// Sets `out` to a copy whose memory comes from malloc, whatever `allocator` is. Fails with a
    /// null `out` if the data are not contiguous, and with a copy without data if memory is
    /// exhausted.
    KpResult clone(KpHandle<TmDataAccess>& out, KpAllocator allocator) const;

    // A line of voxels along the first axis whose coordinate is -1, or along z if neither x nor y
    // is -1. Only the first component of each voxel is used. Never fails: without data, and for
    // types that are not numeric, nothing is read or written. Do not use with sliced data: all
    // values are taken from the first slice.

    /// Reads dims()[axis] values.
    KpResult row(long x, long y, long z, float* out) const;
    /// Writes as many values, clamped to the range of the type and truncated toward zero. NaN
    /// becomes 0. In an int, NaN and values above its range become the smallest int. The function
    /// is const because the description does not change.
    KpResult putRow(long x, long y, long z, const float* in) const;

    /// MD5 of type, components, sizes and voxels, independent of the strides of y and z.
    /// Precondition: rows have no gaps. Without data, MD5 of the first three. Values are added as
    /// their bytes in memory.
    Kp128 hash() const;

    // The lock that a thread holds on a region.

    /// Sets the holder, 0 for none.
    void setLockerThreadId(unsigned long id) { lockerThreadId_ = id; }
    /// 0 for none.
    unsigned long lockerThreadId() const { return lockerThreadId_; }
    /// Makes the calling thread the holder.
    void moveToCurrentThread();
    /// Whether the holder may write.
    bool isLockedWritable() const { return lockedWritable_; }
    /// Sets that flag.
    void lockWritable(bool on) { lockedWritable_ = on; }
    /// Whether the memory is being filled.
    bool isMapDataToMemoryInProgress() const { return mapDataToMemoryInProgress_; }
    /// Sets that flag.
    void setMapDataToMemoryInProgress(bool on) { mapDataToMemoryInProgress_ = on; }
    /// Empty at first.
    const KpBox3i& lockedROI() const { return lockedROI_; }
    /// Sets the locked region.
    void setLockedROI(const KpBox3i& box) { lockedROI_ = box; }

private:
    void fixStrides();
    bool hasVoxels() const;

    // A line along `axis` that begins `offset` bytes after the first voxel.
    template <typename T>
    void rowImpl(long offset, int axis, float* out) const;
    template <typename T>
    void putRowImpl(long offset, int axis, const float* in, float low, float high) const;
    template <typename T>
    void putRowImplF(long offset, int axis, const float* in) const;

    DeleteCallback deleteCallback_ = nullptr;
    void* deleteCallbackData_ = nullptr;
    KpVec3l dims_ = {0L, 0L, 0L};
    KpPrimType primType_;
    std::int32_t nDataVar_ = 0;
    KpAllocator allocator_ = KpAllocator::AllocatorMalloc;
    KpVec3l strides_ = {0L, 0L, 0L};
    unsigned long lockerThreadId_ = 0;
    bool lockedWritable_ = false;
    bool mapDataToMemoryInProgress_ = false;
    KpBox3i lockedROI_ = {0, -1, 0, -1, 0, -1};
    KpDArray<void*> dataPtrs_;  // one block, one a slice, or none
};

template <typename Run>
void TmDataAccess::eachVoxelRun(Run run) const
{
    if (!hasData() || size() <= 0)
        return;
    if (isContiguous()) {
        run(dataPtr(0), static_cast<unsigned long>(size()));
        return;
    }
    const long rowBytes = primType_.size() * dims_[0] * nDataVar_;
    const bool isPacked = strides_[1] == rowBytes;
    const long runs = isPacked ? 1 : dims_[1];
    const long runBytes = isPacked ? rowBytes * dims_[1] : rowBytes;
    for (long z = 0; z < dims_[2]; ++z) {
        for (long y = 0; y < runs; ++y)
            run(dataPtr(0, y, z), static_cast<unsigned long>(runBytes));
    }
}
