#include <kplib/rawdata/KpSuperPackedIndexing.h>

#include <kplib/cpu/FlagBits.h>

#include <algorithm>
#include <bit>
#include <cstdint>

void KpSuperPackedIndexing::appendIndexSpace(const unsigned char* flags, long n)
{
    while (n > 0) {
        if (nPositions_ % blockSize == 0)
            openBlock();
        const long count = std::min(n, blockSize - nPositions_ % blockSize);
        appendWithinBlock(flags, count);
        flags += count;
        n -= count;
    }
}

void KpSuperPackedIndexing::openBlock()
{
    blockCounts_.append(nFlagged_);
    if (currentValue_ != 1)
        runs_.append(0);  // an empty flagged run keeps the turns
    runs_.append(0);
    currentValue_ = 0;
    blockStarts_.append(runs_.size() - 1);
}

// The last run goes on, and each change of the flags ends one.
void KpSuperPackedIndexing::appendWithinBlock(const unsigned char* flags, long n)
{
    unsigned char lengths[blockSize + 1];
    unsigned char* end = lengths;
    const long last = runs_.size() - 1;
    long start = -static_cast<long>(runs_[last]);
    long flagged = 0;
    std::uint64_t value = currentValue_;
    for (long i = 0; i < n; i += 64) {
        const long count = std::min(64L, n - i);
        const std::uint64_t bits = kplib::detail::bitsOfFlags(flags + i, count);
        std::uint64_t changes = (bits ^ (bits << 1 | value)) & (~std::uint64_t{0} >> (64 - count));
        for (; changes != 0; changes &= changes - 1) {
            const long here = i + std::countr_zero(changes);
            *end++ = static_cast<unsigned char>(here - start);
            start = here;
        }
        value = bits >> (count - 1) & 1;
        flagged += std::popcount(bits);
    }
    *end++ = static_cast<unsigned char>(n - start);
    runs_[last] = lengths[0];
    runs_.insert(last + 1, end - lengths - 1, lengths + 1);
    currentValue_ = static_cast<unsigned char>(value);
    nFlagged_ += flagged;
    nPositions_ += n;
}

long KpSuperPackedIndexing::index(long position) const
{
    if (position < 0 || position >= nPositions_)
        return -1;
    long number = blockCounts_[position / blockSize];
    long left = position % blockSize;
    const unsigned char* run = runs_.data() + blockStarts_[position / blockSize];
    for (bool isFlagged = false; left >= *run; isFlagged = !isFlagged) {
        number += isFlagged ? *run : 0;
        left -= *run++;
    }
    const bool isFlagged = (run - runs_.data() - blockStarts_[position / blockSize]) % 2 == 1;
    return isFlagged ? number + left : -1;
}
