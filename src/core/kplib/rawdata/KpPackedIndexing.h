#pragma once

#include <kplib/foundation/KpCheck.h>
#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Dense numbers for a sparse set of flagged positions: the k-th flagged position, counted from 0, has number k.
///
/// A look-up takes constant time. The table takes one byte for each position and 4 bytes for each
/// block of 256, and is built in one pass. Exhausted memory throws KpMemoryException. After
/// construction any number of threads may read it.
class KPLIB_API KpPackedIndexing {
public:
    /// Positions of a block.
    static constexpr int blockSize = 256;

    /// A position is flagged if its byte isn't 0.
    KpPackedIndexing(const unsigned char* flags, int n);
    /// A position is flagged if its bit is set; of fewer than 2^31 bits.
    explicit KpPackedIndexing(const KpBitfield& bits);

    /// The dense number of position `i`. Precondition: the position is flagged.
    int index(long i) const
    {
        KPLIB_CHECK(i >= 0 && i < offsets_.size(), "KpPackedIndexing: the position lies outside");
        return blockBase_[i / blockSize] + offsets_[i];
    }

    /// For each block the number that its first flagged position has, if it has one.
    const KpDArray<int>& blockBase() const { return blockBase_; }
    /// For each position its number less blockBase() of its block; 0 if it isn't flagged.
    const KpDArray<unsigned char>& offsets() const { return offsets_; }
    /// Number of flagged positions.
    int count() const { return count_; }

private:
    template <typename EightFlags>
    void build(long n, EightFlags eightFlags);

    KpDArray<int> blockBase_;
    KpDArray<unsigned char> offsets_;
    int count_ = 0;
};
