#include <kplib/rawdata/KpPackedIndexing.h>
#include <kplib/rawdata/KpSuperPackedIndexing.h>
#include <kplib/volume/KpBitfield.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <vector>

namespace {

using Flags = std::vector<unsigned char>;

template <typename T>
std::vector<T> listOf(const KpDArray<T>& array)
{
    return std::vector<T>(array.begin(), array.end());
}

/// Runs of about `length` positions; flags of all values.
Flags someFlags(long n, unsigned length)
{
    std::mt19937 random(length + static_cast<unsigned>(n));
    Flags flags(static_cast<std::size_t>(n));
    bool isFlagged = length % 2 != 0;
    for (auto& flag : flags) {
        isFlagged = isFlagged != (random() % length == 0);
        flag = isFlagged ? static_cast<unsigned char>(1 + random() % 255) : 0;
    }
    return flags;
}

/// The state that one position after the other gives.
struct OneByOne {
    std::vector<long> blockCounts, blockStarts;
    Flags runs;
    long nFlagged = 0, nPositions = 0;
    unsigned char currentValue = 1;

    void append(bool isFlagged)
    {
        if (nPositions % 255 == 0) {
            blockCounts.push_back(nFlagged);
            runs.insert(runs.end(), currentValue == 1 ? 1 : 2, 0);
            currentValue = 0;
            blockStarts.push_back(static_cast<long>(runs.size()) - 1);
        }
        if (currentValue == isFlagged)
            ++runs.back();
        else
            runs.push_back(1);
        currentValue = isFlagged;
        nFlagged += isFlagged;
        ++nPositions;
    }
};

}  // namespace

TEST(PackedIndexing, numbersFlaggedPositions)
{
    for (long n : {0, 1, 3, 7, 8, 9, 255, 256, 257, 300, 511, 512, 513, 5003})
        for (unsigned length : {1, 2, 5, 100, 100000, 100001}) {
            SCOPED_TRACE(testing::Message() << n << " positions, runs of " << length);
            const Flags flags = someFlags(n, length);
            KpBitfield bits(static_cast<unsigned long>(n), KpBitfield::INIT_UNSET);
            bits.setAll();  // behind the last bit too
            std::vector<int> bases;
            Flags offsets;
            int count = 0;
            for (long i = 0; i < n; ++i) {
                if (i % 256 == 0)
                    bases.push_back(count);
                offsets.push_back(flags[i] ? static_cast<unsigned char>(count - bases.back()) : 0);
                flags[i] ? void(++count) : bits.unset(static_cast<unsigned long>(i));
            }
            const KpPackedIndexing fromFlags(flags.data(), static_cast<int>(n)), fromBits(bits);
            for (const auto* indexing : {&fromFlags, &fromBits}) {
                EXPECT_EQ(listOf(indexing->blockBase()), bases);
                EXPECT_EQ(listOf(indexing->offsets()), offsets);
                EXPECT_EQ(indexing->count(), count);
                for (long i = 0, number = 0; i < n; ++i)
                    ASSERT_TRUE(!flags[i] || indexing->index(i) == number++);
            }
        }
}

TEST(SuperPackedIndexing, growsAsIfByOnePositionAtATime)
{
    for (unsigned length : {1, 2, 5, 100, 100000, 100001})
        for (long piece : {1, 7, 64, 254, 255, 256, 2000}) {
            SCOPED_TRACE(testing::Message() << "runs of " << length << ", pieces of " << piece);
            const Flags flags = someFlags(2000, length);
            KpSuperPackedIndexing indexing;
            OneByOne expected;
            for (long i = 0; i < 2000; i += piece) {
                indexing.appendIndexSpace(flags.data() + i, std::min(piece, 2000 - i));
                for (long k = i; k < std::min(i + piece, 2000L); ++k)
                    expected.append(flags[k] != 0);
                ASSERT_EQ(listOf(indexing.runs()), expected.runs);
            }
            EXPECT_EQ(listOf(indexing.blockCounts()), expected.blockCounts);
            EXPECT_EQ(listOf(indexing.blockStarts()), expected.blockStarts);
            EXPECT_TRUE(indexing.nFlagged() == expected.nFlagged && indexing.nPositions() == 2000);
            EXPECT_EQ(indexing.currentValue(), expected.currentValue);
            for (long i = 0, number = 0; i < 2000; ++i)
                ASSERT_EQ(indexing.index(i), flags[i] ? number++ : -1) << i;
            EXPECT_TRUE(indexing.index(-1) == -1 && indexing.index(2000) == -1);
        }
    KpSuperPackedIndexing empty;
    empty.appendIndexSpace(nullptr, 0);
    empty.appendIndexSpace(nullptr, -5);
    EXPECT_TRUE(empty.currentValue() == 1 && empty.runs().size() == 0 && empty.index(0) == -1);
}
