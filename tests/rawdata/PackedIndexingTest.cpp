#include <kplib/rawdata/KpPackedIndexing.h>
#include <kplib/rawdata/KpSuperPackedIndexing.h>
#include <kplib/volume/KpBitfield.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <vector>

namespace {

using Flags = std::vector<unsigned char>;
const auto asVector = [](const auto& array) { return std::vector(array.begin(), array.end()); };

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

}  // namespace

TEST(PackedIndexing, numbersFlaggedPositions)
{
    for (long n : {0, 1, 7, 8, 9, 255, 256, 257, 300, 512, 513, 5003})
        for (unsigned length : {1, 2, 5, 100, 100000, 100001}) {
            SCOPED_TRACE(testing::Message() << n << " positions, runs of " << length);
            const Flags flags = someFlags(n, length);
            KpBitfield bits(static_cast<unsigned long>(n), KpBitfield::INIT_SET);  // after the last bit too
            for (unsigned long i = 0; i < bits.nBits(); ++i)
                flags[i] ? bits.set(i) : bits.unset(i);
            const KpPackedIndexing fromFlags(flags.data(), static_cast<int>(n)), fromBits(bits);
            for (const auto* indexing : {&fromFlags, &fromBits}) {
                ASSERT_EQ(std::tuple(indexing->blockBase().size(), indexing->offsets().size()),
                          std::tuple((n + 255) / 256, n));
                int count = 0, base = 0;
                for (long i = 0; i < n; ++i) {
                    base = i % 256 == 0 ? count : base;
                    ASSERT_EQ(indexing->blockBase()[i / 256], base);
                    ASSERT_EQ(indexing->offsets()[i], flags[i] ? count - base : 0);
                    ASSERT_TRUE(!flags[i] || indexing->index(i) == count++);
                }
                EXPECT_EQ(indexing->count(), count);
            }
        }
}

TEST(SuperPackedIndexing, growsAsIfByOnePositionAtATime)
{
    for (unsigned length : {1, 2, 5, 100, 100000, 100001}) {
        const Flags flags = someFlags(2000, length);
        std::vector<long> counts, starts;
        Flags runs;
        bool value = true;
        for (long i = 0, nFlagged = 0; i < 2000; ++i) {
            if (i % 255 == 0) {
                counts.push_back(nFlagged);
                runs.insert(runs.end(), value ? 1 : 2, 0);
                starts.push_back(static_cast<long>(runs.size()) - 1);
                value = false;
            }
            value == (flags[i] != 0) ? void(++runs.back()) : runs.push_back(1);
            value = flags[i] != 0;
            nFlagged += value;
        }
        for (long piece : {1, 7, 64, 254, 255, 256, 2000}) {
            SCOPED_TRACE(testing::Message() << "runs of " << length << ", pieces of " << piece);
            KpSuperPackedIndexing indexing;
            for (long i = 0; i < 2000; i += piece)
                indexing.appendIndexSpace(flags.data() + i, std::min(piece, 2000 - i));
            indexing.appendIndexSpace(nullptr, -5);
            EXPECT_EQ(asVector(indexing.runs()), runs);
            EXPECT_EQ(indexing.currentValue(), value);
            EXPECT_EQ(asVector(indexing.blockCounts()), counts);
            EXPECT_EQ(asVector(indexing.blockStarts()), starts);
            long number = 0;
            for (long i = 0; i < 2000; ++i)
                ASSERT_EQ(indexing.index(i), flags[i] ? number++ : -1) << i;
            EXPECT_EQ(std::tuple(indexing.nFlagged(), indexing.nPositions()), std::tuple(number, 2000L));
            EXPECT_EQ(std::tuple(indexing.index(-1), indexing.index(2000)), std::tuple(-1L, -1L)) << "outside";
        }
    }
    EXPECT_EQ(KpSuperPackedIndexing().currentValue(), 1);
    EXPECT_EQ(KpSuperPackedIndexing().index(0), -1);
}
