#include <kplib/foundation/KpMemoryException.h>
#include <kplib/volume/KpMorphology.h>
#include <kplib/volume/detail/MorphologyKernels.h>

#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <random>
#include <vector>

using namespace kplib::detail;
using Field = KpBitfield;

namespace {

/// A volume of one byte a voxel, and the definition of a pass on it.
struct Volume {
    KpVec3i dims;
    std::vector<char> voxels;

    char& at(int x, int y, int z)
    {
        return voxels[(static_cast<std::size_t>(z) * dims[1] + y) * dims[0] + static_cast<std::size_t>(x)];
    }
    bool isInside(int x, int y, int z) const
    {
        return x >= 0 && y >= 0 && z >= 0 && x < dims[0] && y < dims[1] && z < dims[2];
    }

    Volume pass(int reach, bool erodes)
    {
        Volume result{dims, voxels};
        for (int z = 0; z < dims[2]; ++z)
            for (int y = 0; y < dims[1]; ++y)
                for (int x = 0; x < dims[0]; ++x)
                    for (int k = 0; k < 27; ++k) {
                        const int dx = k % 3 - 1, dy = k / 3 % 3 - 1, dz = k / 9 - 1;
                        if (std::abs(dx) + std::abs(dy) + std::abs(dz) <= reach && isInside(x + dx, y + dy, z + dz) &&
                            at(x + dx, y + dy, z + dz) != erodes)
                            result.at(x, y, z) = !erodes;
                    }
        return result;
    }

    Field field() const
    {
        Field bits(voxels.size(), Field::INIT_UNSET);
        for (std::size_t i = 0; i < voxels.size(); ++i)
            if (voxels[i])
                bits.set(i);
        return bits;
    }
};

Volume noise(const KpVec3i& dims, double density, std::mt19937& random)
{
    Volume volume{dims, std::vector<char>(static_cast<std::size_t>(dims[0]) * dims[1] * dims[2])};
    for (char& voxel : volume.voxels)
        voxel = std::bernoulli_distribution(density)(random);
    return volume;
}

Field morphed(const Field& src, const KpVec3i& dims, int reach, bool erodes, int iterations, bool fast)
{
    constexpr decltype(&KpMorphology::dilation3D) dilations[] = {KpMorphology::dilation3D, KpMorphology::dilation3D_18,
                                                                 KpMorphology::dilation3D_26};
    constexpr decltype(&KpMorphology::erosion3D) erosions[] = {KpMorphology::erosion3D, KpMorphology::erosion3D_18,
                                                               KpMorphology::erosion3D_26};
    Field dst;
    if (erodes)
        erosions[reach - 1](src, dst, dims, iterations, fast);
    else
        dilations[reach - 1](src, dst, dims, static_cast<unsigned int>(iterations), fast);
    return dst;
}

constexpr decltype(&KpMorphology::dilation2D_4) planar[][2] = {{KpMorphology::dilation2D_4, KpMorphology::erosion2D_4},
                                                               {KpMorphology::dilation2D_8, KpMorphology::erosion2D_8}};
constexpr double densities[] = {0.001, 0.02, 0.2, 0.5, 0.8, 0.98, 0.999};

TEST(Morphology, equalsTheDefinitionForEveryRowWidth)
{
    std::mt19937 random(52);
    for (int width = 1; width <= 513; width += width == 130 ? 380 : 1)
        for (int round = 0; round < 4; ++round) {
            const KpVec3i dims(width, 1 + static_cast<int>(random() % 4), 1 + static_cast<int>(random() % 4));
            const double density = densities[random() % std::size(densities)];
            const bool erodes = round % 2 != 0;
            const Volume volume = noise(dims, density, random);
            const Field src = volume.field();
            for (int reach = 1; reach <= 3; ++reach) {
                Volume expected = volume;
                const int iterations = 1 + static_cast<int>(random() % (round < 2 ? 2 : 6));
                for (int i = 0; i < iterations; ++i)
                    expected = expected.pass(reach, erodes);
                SCOPED_TRACE(testing::Message() << width << 'x' << dims[1] << 'x' << dims[2] << " reach " << reach
                                                << " erodes " << erodes << " iterations " << iterations);
                const Field result = expected.field();
                ASSERT_TRUE(morphed(src, dims, reach, erodes, iterations, true) == result);
                ASSERT_TRUE(width % 8 != 1 || morphed(src, dims, reach, erodes, iterations, false) == result);
            }
        }
}

TEST(Morphology, everyPathEqualsTheReferenceAndStaysInItsField)
{
    std::mt19937 random(53);
    for (const auto& path : morphologyPaths())
        for (const KpVec3i& dims : {KpVec3i(1, 1, 70), {2, 2, 2}, {7, 3, 9}, {64, 8, 3}, {96, 9, 5}, {181, 21, 4}})
            for (double density : {0.02, 0.9})
                for (int reach = 1; path.usable && reach <= 3; ++reach)
                    for (bool erodes : {false, true}) {
                        const Field src = noise(dims, density, random).field();
                        Field once(src), twice(src), result(src.nBits(), Field::INIT_UNSET);
                        morphologyByVoxel(src, once, dims, MorphologyReach{reach}, erodes);
                        morphologyByVoxel(once, twice, dims, MorphologyReach{reach}, erodes);
                        const MorphologyJob job{src.data(), result.data(),          dims[0], dims[1], dims[2],
                                                2,          MorphologyReach{reach}, erodes};
                        std::vector<char> area(morphologyAreaBytes(job));
                        path.run(job, area.data());
                        EXPECT_TRUE(result == twice) << path.name << ' ' << dims[0] << ' ' << reach << erodes;
                        const unsigned long spare = src.nBits() % 32;
                        EXPECT_EQ(result.data()[src.nBits() / 32] >> spare, 0U) << "bits behind the last voxel";
                    }
}

TEST(Morphology, onceMoreThroughMemoryWhenThePassesAreMany)
{
    std::mt19937 random(54);
    const Volume volume = noise({700, 200, 3}, 0.00003, random);
    const Field src = volume.field();
    for (int reach = 1; reach <= 3; ++reach) {
        const MorphologyJob job{nullptr, nullptr, 700, 200, 3, 50, MorphologyReach{reach}, false};
        ASSERT_LT(morphologyPassesAtOnce(job), 50) << "not a case of this test";
        Field expected(src);
        for (int i = 0; i < 50; ++i)
            expected = morphed(expected, volume.dims, reach, false, 1, true);
        EXPECT_TRUE(expected.isAnyBitUnset());
        EXPECT_TRUE(morphed(src, volume.dims, reach, false, 50, true) == expected) << reach;
        EXPECT_FALSE(morphed(src, volume.dims, reach, false, 2000000000, true).isAnyBitUnset());
    }
}

TEST(Morphology, planesAreOnePass)
{
    EXPECT_TRUE(KpMorphology::unitTest2D());
    std::mt19937 random(55);
    for (int width = 1; width <= 130; ++width)
        for (int height : {1, 2, 5}) {
            const KpVec2i dims(width, height);
            Volume volume = noise({width, height, 1}, densities[random() % std::size(densities)], random);
            const Field src = volume.field();
            Field dst;
            for (const int reach : {1, 2})
                for (const bool erodes : {false, true}) {
                    planar[reach - 1][erodes](src, dst, dims);
                    EXPECT_TRUE(dst == volume.pass(reach, erodes).field()) << width << ' ' << height << ' ' << reach;
                }
        }
}

TEST(Morphology, leavesTheSpareBitsOfAReusedField)
{
    for (const int width : {40, 64})  // within the last word, and all of the spare one
        for (const int passes : {1, 2, 3})
            for (const bool fast : {true, false})
                for (const auto run : {KpMorphology::dilation3D_26, KpMorphology::dilation3D}) {
                    const KpVec3i dims(width, 5, 1);
                    const Field src(static_cast<unsigned long>(width) * 5, Field::INIT_UNSET);
                    Field dst = src;
                    dst.setAll();
                    const auto before = dst.data()[dst.nWords() - 1];
                    run(src, dst, dims, static_cast<unsigned>(passes), fast);
                    const auto spare = ~0U << dst.nBits() % 32;
                    EXPECT_EQ(dst.data()[dst.nWords() - 1] & spare, before & spare) << width << ' ' << passes << fast;
                    EXPECT_FALSE(dst.isAnyBitSet());
                }
}

TEST(Morphology, nothingToDo)
{
    const Field src(40, Field::INIT_SET);
    for (int iterations : {0, -1})  // the fields are of other sizes at first
        EXPECT_TRUE(morphed(src, {40, 1, 1}, 1, iterations < 0, iterations, true) == src);
    for (const KpVec3i& dims : {KpVec3i(0, 3, 3), {3, -1, 3}, {-2, -2, 3}, {3, 3, 0}})
        EXPECT_EQ(morphed(src, dims, 3, true, 2, true).nBits(), 0UL);
    Field dst;
    KpMorphology::dilation2D_8(src, dst, {-4, -10});
    EXPECT_EQ(dst.nBits(), 0UL);
    const KpVec3i huge(1 << 22, 1 << 22, 1 << 22);  // 2^66 voxels are not none
    EXPECT_THROW(KpMorphology::erosion3D(src, dst, huge, 0, true), KpMemoryException);
}

TEST(Morphology, withoutAWorkAreaSetsAllOrDoesWithout)
{
    const std::tuple<int, int, bool> cases[] = {
        {31, 3, false}, {32, 1, false}, {33, 1, true}, {32, 2, true}, {32, 3, true}};
    std::mt19937 random(56);
    for (const auto& [width, reach, fillsAll] : cases)
        for (bool erodes : {false, true}) {
            const KpVec3i dims(width, 4, 1);
            const Field src = noise(dims, 0.5, random).field();
            const Field plain = morphed(src, dims, reach, erodes, 1, false);
            Field in3D(src.nBits(), Field::INIT_UNSET), inPlane(in3D);
            {
                const kplib::test::FailingMalloc failing(0);
                planar[reach > 1][erodes](src, inPlane, {width, 4});
            }
            {
                const kplib::test::FailingMalloc failing(1);  // the result takes the first
                in3D = morphed(src, dims, reach, erodes, 1, true);
            }
            EXPECT_TRUE(fillsAll ? !in3D.isAnyBitUnset() : in3D == plain) << width << ' ' << reach;
            const bool fillsPlane = fillsAll && reach == 1;  // 8 neighbours need no area in aligned rows
            EXPECT_TRUE(reach == 2 || (fillsPlane ? !inPlane.isAnyBitUnset() : inPlane == plain)) << width;
        }
}

}  // namespace
