#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/rawdata/KpTypedPointer.h>

/// Labels the connected regions of a 2D or 3D image in one raster pass, and counts their voxels.
///
///     short image[] = {9, 9, 0, 5, 0, 0, 0, 5};
///     const int dims[] = {4, 2, 1};
///     unsigned short* labels = nullptr;
///     KpDArray<KpConnectedComponents::Component> table;
///     const int n = KpConnectedComponents::labelCC(image, dims, 6, labels, 0, 5, 9, 0, 0, &table);
///     std::printf("%d regions, the first of %u voxels\n", n, table[1].nVoxels);
///     // prints: 2 regions, the first of 2 voxels
///     kpfree(labels);
///
/// Images are dense, x fastest; `dims` are their three sizes. Neighbours are 4 or 8 (in the
/// plane), 6, 18, 26, or 10 (8 and the faces in z). With any other number each voxel is a
/// component of its own. The result is an image of labels and a table: entry 0 is the background,
/// all zero; entry i is component i, numbered in raster order of the first voxels. If regions
/// meet, one becomes an alias of the other. Intentional: only one step of an alias is followed
/// while labelling, so a component of an intricate region may be divided, or its counts may miss
/// some voxels; peers depend on these numbers.
///
/// Threads: runs on the calling thread; threads may label different images at once.
///
/// Memory: a table that grows with the number of regions, and two bits for each voxel of a slice,
/// one if there is a single slice, with rows rounded up to 8, 16, 32 or a multiple of 64 voxels;
/// rows below 8 voxels need none. Exhausted memory throws KpMemoryException.
class KPLIB_API KpConnectedComponents {
public:
    /// What the table holds of a component.
    struct KPLIB_API Component {
        int id = 0;  ///< its own index, or that of the entry it is an alias of
        /// Number of its voxels.
        unsigned nVoxels = 0;
        unsigned nSeeds = 0;       ///< voxels at or above the upper threshold; of labels, the value of the region
        float sum[3] = {0, 0, 0};  ///< of the voxels' x, y and z, one added after the other; over nVoxels: the centre

        /// Absorbs the statistics of `other` (its seeds only if `labelMode` is 0), zeroes them there and gives `other`
        /// the id of this one, which need not be the index of this one.
        void addAlias(Component& other, int labelMode);
    };

    /// Largest size of a table, the background included.
    template <typename L>
    static constexpr int maxComponents = sizeof(L) == 2 ? 64999 : 9999999;

    /// Labels regions of voxels at or above `low` (NaN counts as such), and counts their voxels at
    /// or above `high` as seeds. For integers both thresholds are rounded and clamped to the
    /// element type. If `labels` is null, it receives an image of kpmalloc, which the caller owns,
    /// whatever the result. Labels may take the place of unsigned shorts of `data`. `components`
    /// may be null. Returns the number of components, or -1 with an error in the log if the
    /// elements are not numeric or there are too many components (the labels are then incomplete).
    static int labelCC(KpTypedPointer data, const int* dims, int neighbours, unsigned short*& labels, int, double low,
                       double high, int, int, KpDArray<Component>* components);

    /// Regions of equal value in an image of labels, those of value 0 among them. Returns as labelCC().
    static int labelLabels(unsigned char* data, const int* dims, int neighbours, unsigned short* labels, int, int,
                           KpDArray<Component>& components);
    /// As above, for more components.
    static int labelLabelsHuge(unsigned char* data, const int* dims, int neighbours, int* labels, int, int,
                               KpDArray<Component>& components);

    /// By the number of voxels, ascending: -1, 0 or 1.
    static int compareComponents(const Component& a, const Component& b);

    /// The neighbours that precede a voxel in raster order, in the order of merging: `n` steps
    /// (dx, dy, dz) and their offsets in elements. The arrays must have at least 13 elements.
    static void mknbtableprev(int neighbours, const int* dims, int& n, int* offsets, int (*deltas)[3]);

    /// Adds a zeroed entry and returns its index. At the limit, aliases are cleaned out first, in
    /// the first `nLabelled` labels too; if that frees no entry, -1 with an error in the log. L is
    /// unsigned short or int.
    template <typename L>
    static int addNewComponent(KpDArray<Component>& components, L* labels, int nLabelled);

    /// Removes aliases, and components of fewer than `minVoxels` voxels or `minSeeds` seeds (if
    /// those are above 0), and renumbers the others in order, also in the first `nLabelled`
    /// labels. Returns the new size of the table.
    template <typename L>
    static int cleanup_components(KpDArray<Component>& components, L* labels, int nLabelled, int minVoxels,
                                  int minSeeds);

    /// The pass of all functions above: labels regions of voxels not below `low`, or, with
    /// `labelMode`, of equal value among them. T is unsigned char, short, unsigned short, int,
    /// float or double with L unsigned short, or unsigned char with int. Linear in the voxels; a
    /// background voxel takes far less than a nanosecond.
    template <typename T, typename L>
    static int do_label(T* data, L* labels, KpDArray<Component>& components, T low, T high, const int* dims,
                        int neighbours, int labelMode);

    // Diagnostics, shared by all threads and set to 0 when a labelling starts: with several at once, counts mix.
    static int dbg_add;    ///< new components
    static int dbg_merge;  ///< always 0
    static int dbg_clean;  ///< clean-ups
};

/// Components are made by their constructor, so that an array has no uninitialised ones.
template <>
struct KpElementTraits<KpConnectedComponents::Component> {
    /// Constructed, copied and destroyed one by one.
    static constexpr KpElementKind kind = KpElementKind::Managed;
    /// May be moved as bytes.
    static constexpr bool movesAsBytes = true;
};
