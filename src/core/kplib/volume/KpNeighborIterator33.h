#pragma once

#include <kplib/foundation/KpExport.h>

#include <cstdint>

/// The neighbours of a voxel in a 3x3x3 window of a dense volume, x fastest: a table of offsets,
/// directions and weights, so that a loop over neighbours needs no arithmetic on coordinates.
///
/// A table is for volumes of one size. Offsets are ints: those of slices of 2^31 voxels and more
/// are truncated to their low 32 bits. After the weights are set, any number of threads may read
/// it.
class KPLIB_API KpNeighborIterator33 {
public:
    /// Largest number of neighbours.
    static constexpr int maxNeighbors = 26;

    /// Which directions a neighbour lies in. A voxel at the volume's border has those bits set that lead outside; a
    /// neighbour that shares one of them lies outside.
    enum Border : unsigned char {
        XMin = 1,   ///< toward lower x
        XMax = 2,   ///< toward higher x
        YMin = 4,   ///< toward lower y
        YMax = 8,   ///< toward higher y
        ZMin = 16,  ///< toward lower z
        ZMax = 32,  ///< toward higher z
    };

    /// `nNeighbors` is 4 or 8 (in plane), 10 (8 and the faces in z), 6, 18 or 26; any other makes a table that is never
    /// filled. `dims` are three sizes.
    KpNeighborIterator33(int nNeighbors, const int* dims);

    /// Sets the weights from a table of 27 for the whole window: that of (dx, dy, dz) is at 13 +
    /// dx + 3 dy + 9 dz, and the middle one is not read. Sorts by weight unless `sort` is 0.
    /// Integers are also stored as floats, and floats as integers, truncated toward zero. chars
    /// are signed.
    void setWeights(const char* w, int sort);
    /// @{
    /// As above.
    void setWeights(const short* w, int sort);
    void setWeights(const int* w, int sort);
    void setWeights(const float* w, int sort);
    /// @}

    /// Sorts all by ascending weight, by the integers rounded to float or by the floats, and gives the index of the
    /// first positive one; 26 if there is none.
    int sort_iweights();
    /// As above, by the floats.
    int sort_fweights();

    /// The number that the constructor got.
    int nNeighbors() const { return nNeighbors_; }
    /// The three sizes that the constructor got.
    const int* dims() const { return dims_; }
    // One a neighbour, nNeighbors() of them.
    const int* offsets() const { return offsets_; }      ///< in elements: dx + dy * dims[0] + dz * dims[0] * dims[1]
    const int* iweights() const { return iweights_; }    ///< weights as integers
    const float* fweights() const { return fweights_; }  ///< weights as floats
    const std::int8_t (*deltas() const)[3] { return deltas_; }  ///< dx, dy, dz, each -1, 0 or 1
    const unsigned char* borders() const { return borders_; }   ///< of Border

private:
    bool isFilled() const;
    template <typename Weight>
    void setIntegers(const Weight* w, int sort);
    template <typename Weight>
    int sortBy(const Weight* weights);

    int nNeighbors_;
    int dims_[3];
    int offsets_[maxNeighbors];
    int iweights_[maxNeighbors];
    float fweights_[maxNeighbors];
    std::int8_t deltas_[maxNeighbors][3];
    unsigned char borders_[maxNeighbors];
};
