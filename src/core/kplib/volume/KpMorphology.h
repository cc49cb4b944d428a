#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec2i.h>
#include <kplib/geometry/KpVec3i.h>
#include <kplib/volume/KpBitfield.h>

/// Dilation, erosion and flood fill of masks.
///
///     KpBitfield mask(5 * 5 * 5, KpBitfield::INIT_UNSET), grown;
///     mask.set(2 + 2 * 5 + 2 * 25);
///     KpMorphology::dilation3D(mask, grown, KpVec3i(5, 5, 5), 1, true);  // 6 neighbours
///     std::printf("%lu voxels\n", grown.nSetBits());  // prints: 7 voxels
///
/// A mask is a field of dims[0] * dims[1] * dims[2] bits, x fastest, rows and slices without gaps; `src` has that many.
/// Neighbours are the voxels at most one step away along each axis: 6 (in the plane 4) along one axis, 18 along two, 26
/// (8) along all three. Voxels have no size here; wider effects come from repetition.
///
/// One pass of dilation sets a voxel if it or a neighbour is set in `src`; one of erosion keeps a set voxel if all its
/// neighbours are set. Outside the volume dilation sees background and erosion foreground, so neither acts from there.
/// `dst`, another object than `src`, is brought to the size of the volume. If it has that size already, its spare bits,
/// which a digest may contain, stay as they are. Volumes of size 0 or less have no voxels.
///
/// `fast` works on words, many voxels at a time, otherwise each voxel looks at its neighbours; the results are the
/// same. Work areas are a few slices. If one that is needed cannot be allocated, all bits of `dst` are set and nothing
/// is logged. Rows of a multiple of 32 voxels need none for 6, 4 and 8 neighbours, rows of less than 32 need none at
/// all. Other exhausted memory is a KpMemoryException. Any number of threads may work at once on fields of their own.
class KPLIB_API KpMorphology {
public:
    /// `iterations` passes; none copies.
    static void dilation3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                           bool fast);
    /// @{
    /// As above, with 18 or 26 neighbours.
    static void dilation3D_18(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                              bool fast);
    static void dilation3D_26(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                              bool fast);
    /// @}

    /// `iterations` passes, at least one; less copies.
    static void erosion3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast);
    /// @{
    /// As above, with 18 or 26 neighbours.
    static void erosion3D_18(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast);
    static void erosion3D_26(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, int iterations, bool fast);
    /// @}

    // One fast pass over a plane.

    /// @{
    /// With 4 or 8 neighbours.
    static void dilation2D_4(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims);
    static void erosion2D_4(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims);
    static void dilation2D_8(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims);
    static void erosion2D_8(const KpBitfield& src, KpBitfield& dst, const KpVec2i& dims);
    /// @}

    /// Sets in `dst` what is connected with a seed by faces through voxels whose bit in `src` is `value`; gives the
    /// number of voxels filled. `dims` are three sizes.
    ///
    /// What `dst` holds, resized first if it is of another size, counts as visited and stops the
    /// fill. A run along x that is entered where `dst` is clear is filled as a rule from end to
    /// end, and visited voxels in it count again. `box`, if not null, becomes xmin, xmax, ymin,
    /// ymax, zmin, zmax of what was filled and of all seeds, also those outside or on a wrong
    /// value; without seeds it stays. If `src` is not of the size of `dims`, or a size is above
    /// 32768 (one error in the log), the result is 0 and nothing changes. Time grows with the
    /// number of runs.
    static unsigned long floodfill(const KpBitfield& src, KpBitfield& dst, const KpDArray<KpVec3i>& seeds, bool value,
                                   const int* dims, int* box);

    /// Whether the operations on planes are right for each pixel of a set of patterns.
    static bool unitTest2D();
};
