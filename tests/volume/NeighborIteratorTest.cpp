#include <kplib/volume/KpNeighborIterator33.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <random>
#include <set>

namespace {

constexpr int dims[] = {10, 20, 30};

template <typename Weight>
std::vector<Weight> randomWeights(unsigned seed, int low, int high)
{
    std::mt19937 random(seed);
    std::vector<Weight> weights(27);
    for (Weight& weight : weights)
        weight = static_cast<Weight>(std::uniform_int_distribution(low, high)(random));
    return weights;
}

/// Each entry is one of the window, with the offset, border and weight that its direction has.
template <typename Weight>
void expectWhole(const KpNeighborIterator33& table, const std::vector<Weight>& weights)
{
    std::set<int> offsets;
    for (int i = 0; i < table.nNeighbors(); ++i) {
        const std::int8_t* const d = table.deltas()[i];
        EXPECT_EQ(table.offsets()[i], d[0] + 10 * d[1] + 200 * d[2]);
        const int border =
            (d[0] < 0) + 2 * (d[0] > 0) + 4 * (d[1] < 0) + 8 * (d[1] > 0) + 16 * (d[2] < 0) + 32 * (d[2] > 0);
        EXPECT_EQ(table.borders()[i], border);
        const Weight weight = weights[static_cast<std::size_t>(13 + d[0] + 3 * d[1] + 9 * d[2])];
        EXPECT_EQ(std::tuple(table.fweights()[i], table.iweights()[i]), std::tuple(weight, weight));
        offsets.insert(table.offsets()[i]);
    }
    EXPECT_EQ(offsets.size(), static_cast<std::size_t>(table.nNeighbors()));
}

}  // namespace

TEST(KpNeighborIterator33, holdsEachNeighborOnceInItsOrder)
{
    // The count, the most absolute offsets of z and of all, the first and the last offset.
    const std::tuple<int, int, int, int, int> cases[] = {{4, 0, 1, -10, 1},  {6, 1, 1, -200, 1},  {8, 0, 2, -11, 1},
                                                         {10, 1, 2, -11, 1}, {18, 1, 2, -210, 1}, {26, 1, 3, -211, 1}};
    for (const auto& [count, mostInPlane, mostSteps, firstOffset, lastOffset] : cases) {
        KpNeighborIterator33 table(count, dims);
        const auto weights = randomWeights<short>(1, -5, 5);
        table.setWeights(weights.data(), 0);
        expectWhole(table, weights);
        EXPECT_EQ(std::tuple(table.offsets()[0], table.offsets()[count - 1]), std::tuple(firstOffset, lastOffset));
        for (int i = 0; i < count; ++i) {
            const std::int8_t* const d = table.deltas()[i];
            EXPECT_LE(std::abs(d[2]), mostInPlane);
            EXPECT_LE(std::abs(d[0]) + std::abs(d[1]) + std::abs(d[2]), count == 10 && d[2] != 0 ? 1 : mostSteps);
        }
    }
}

TEST(KpNeighborIterator33, sortsAllByWeightAndTellsTheFirstPositive)
{
    for (const int count : {4, 6, 8, 10, 18, 26})
        for (unsigned seed = 0; seed < 20; ++seed) {
            KpNeighborIterator33 table(count, dims);
            const auto integers = randomWeights<int>(seed, -3, 3);
            table.setWeights(integers.data(), 1);
            expectWhole(table, integers);
            int firstPositive = 26;
            for (int i = count - 1; i >= 0; --i) {
                EXPECT_TRUE(i == 0 || table.iweights()[i - 1] <= table.iweights()[i]);
                if (table.iweights()[i] > 0)
                    firstPositive = i;
            }
            EXPECT_EQ(table.sort_iweights(), firstPositive);
            EXPECT_EQ(table.sort_fweights(), firstPositive);
        }
    float floats[27];
    std::fill_n(floats, 27, 2.75F);
    floats[12] = -1e30F;
    floats[14] = 0.5F;
    KpNeighborIterator33 table(6, dims);
    table.setWeights(floats, 1);
    EXPECT_EQ(std::tuple(table.offsets()[0], table.offsets()[1]), std::tuple(-1, 1));
    EXPECT_EQ(std::tuple(table.iweights()[0], table.iweights()[1], table.iweights()[5]), std::tuple(INT32_MIN, 0, 2));
    EXPECT_EQ(table.sort_fweights(), 1);
    EXPECT_EQ(table.sort_iweights(), 2);
    const int largest[] = {65536, 65536, 2};  // a slice is 2^32 voxels, of which an int keeps nothing
    EXPECT_EQ(KpNeighborIterator33(6, largest).offsets()[4], 65536);
    EXPECT_EQ(KpNeighborIterator33(6, largest).offsets()[3], 0);
    KpNeighborIterator33 unlisted(7, dims);
    unlisted.setWeights(floats, 1);
    EXPECT_EQ(unlisted.sort_fweights(), 26);
}
