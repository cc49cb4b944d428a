#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>

/// Dense numbers for a sparse set of flagged positions, as KpPackedIndexing, but stored as run
/// lengths, and positions can be appended. Takes one byte for each run, and at most two bytes and
/// two longs for each block of 255 positions.
///
/// Exhausted memory is a KpMemoryException, after which only the destructor may follow. One thread
/// at a time may append, or any number read.
class KPLIB_API KpSuperPackedIndexing {
public:
    /// Not 256, so that a run, which never crosses the end of a block, fits one byte.
    static constexpr long blockSize = 255;

    /// Empty.
    KpSuperPackedIndexing() = default;

    /// Appends `n` positions, flagged where the byte isn't 0; nothing for `n` below 1. O(n).
    void appendIndexSpace(const unsigned char* flags, long n);

    /// The dense number of a position, or -1 if it is not flagged or does not exist. Walks the
    /// runs of one block.
    long index(long position) const;

    /// For each block the number of flagged positions before it.
    const KpDArray<long>& blockCounts() const { return blockCounts_; }
    /// For each block the position in runs() of its first run, an unflagged one.
    const KpDArray<long>& blockStarts() const { return blockStarts_; }
    /// Lengths of runs, unflagged and flagged ones by turns; 0 where two of one kind meet.
    const KpDArray<unsigned char>& runs() const { return runs_; }
    /// Number of flagged positions.
    long nFlagged() const { return nFlagged_; }
    /// Number of positions.
    long nPositions() const { return nPositions_; }
    /// What the last run consists of; 1 as long as there is none.
    unsigned char currentValue() const { return currentValue_; }

private:
    void openBlock();
    void appendWithinBlock(const unsigned char* flags, long n);

    KpDArray<long> blockCounts_;
    KpDArray<long> blockStarts_;
    KpDArray<unsigned char> runs_;
    long nFlagged_ = 0;
    long nPositions_ = 0;
    unsigned char currentValue_ = 1;
};
