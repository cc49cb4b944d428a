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
/// A mask is a KpBitfield of dims[0] * dims[1] * dims[2] bits, x fastest, without gaps between
/// rows or slices. `src` must have that size. The neighbours of a voxel are at most one step away
/// along each axis: 6 (4 in the plane) differ along one axis, 18 along one or two, 26 (8) along
/// any. The size of voxels is not considered; repeat passes for a wider effect.
///
/// One pass of dilation sets a voxel if it or one of its neighbours is set in `src`. One pass of
/// erosion keeps a set voxel if all its neighbours are set. `dst` must be another object than
/// `src`. It is resized to the volume; if it has that size already, its spare bits stay as they
/// are, and a digest may contain them. Volumes with a size of 0 or less have no voxels.
///
/// Borders: dilation treats voxels outside the volume as unset, erosion as set.
///
/// `fast`: processes words of many voxels instead of one voxel at a time. The results are the
/// same.
///
/// Errors: if `fast` cannot allocate its work area, rows of less than 32 voxels, and with 4, 6 or
/// 8 neighbours also rows of a multiple of 32, are processed voxel by voxel. For all other rows,
/// all bits of `dst` are set and nothing is logged. Other exhausted memory throws
/// KpMemoryException.
///
/// Threads: safe for distinct fields.
///
/// Memory: the work area of `fast` has six slices, or more for several passes while it fits into
/// the cache. Without `fast`, several passes take one more mask.
class KPLIB_API KpMorphology {
public:
    /// Performs `iterations` passes. 0 copies `src`.
    static void dilation3D(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                           bool fast);
    /// @{
    /// As above, with 18 or 26 neighbours.
    static void dilation3D_18(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                              bool fast);
    static void dilation3D_26(const KpBitfield& src, KpBitfield& dst, const KpVec3i& dims, unsigned int iterations,
                              bool fast);
    /// @}

    /// Performs `iterations` passes. A number below 1 copies `src`.
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

    /// Sets in `dst` the voxels that are connected with a seed by faces through voxels whose bit
    /// in `src` is `value`. Returns the number of filled voxels. `dims` are three sizes.
    ///
    /// Bits that are set in `dst` count as visited and stop the fill. `dst` is resized first if it
    /// has another size. The fill sets runs along x: a run that is entered at a voxel which is
    /// clear in `dst` is usually filled from end to end, and visited voxels in it are counted
    /// again.
    ///
    /// `box`, if not null, becomes xmin, xmax, ymin, ymax, zmin, zmax of the filled voxels and of
    /// all seeds, also of seeds outside the volume or on another value. Without seeds it stays
    /// unchanged.
    ///
    /// Errors: returns 0 and changes nothing if `src` does not have the size of `dims`, or if a
    /// size is above 32768, which is one error in the log.
    ///
    /// Complexity: linear in the number of runs.
    static unsigned long floodfill(const KpBitfield& src, KpBitfield& dst, const KpDArray<KpVec3i>& seeds, bool value,
                                   const int* dims, int* box);

    /// Whether the operations on planes compute each pixel of a set of patterns correctly.
    static bool unitTest2D();
};
