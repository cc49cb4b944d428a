#include "Elements.h"

#include <kplib/rawdata/detail/TransposeKernels.h>

#include <support/FailingMalloc.h>

using namespace kplib::test;

namespace {

const int perms[6][3] = {{0, 1, 2}, {0, 2, 1}, {1, 0, 2}, {2, 1, 0}, {2, 0, 1}, {1, 2, 0}};

Bytes noise(long size)
{
    return someValues<std::uint8_t>(size, static_cast<unsigned>(size));
}

/// The definition: each voxel goes to the place that its coordinates have in the new order.
Bytes permuted(const Bytes& from, const int* dims, const int* perm, int voxelSize)
{
    Bytes to(from.size());
    int at[3];
    const unsigned char* voxel = from.data();
    for (at[2] = 0; at[2] < dims[2]; ++at[2])
        for (at[1] = 0; at[1] < dims[1]; ++at[1])
            for (at[0] = 0; at[0] < dims[0]; ++at[0], voxel += voxelSize) {
                const int place = (at[perm[2]] * dims[perm[1]] + at[perm[1]]) * dims[perm[0]] + at[perm[0]];
                std::copy_n(voxel, voxelSize, to.data() + place * voxelSize);
            }
    return to;
}

}  // namespace

TEST(SwapDims, putsEachVoxelWhereItsCoordinatesAre)
{
    const std::pair<KpPrimType, int> voxels[] = {
        {KpPrimType::Byte, 1},   {KpPrimType::Byte, 3},   {KpPrimType::Byte, 4},  {KpPrimType::UInt, 1},
        {KpPrimType::UShort, 1}, {KpPrimType::Double, 1}, {KpPrimType::Float, 2}, {KpPrimType::Double, 3}};
    for (const auto& [type, nDataVar] : voxels)
        for (const auto& size :
             {std::array{2, 3, 4}, {5, 5, 5}, {1, 7, 3}, {7, 1, 3}, {7, 3, 1}, {33, 17, 9}, {40, 8, 16}})
            for (const int* perm : perms) {
                std::array<int, 3> dims = size;
                const int voxelSize = type.size() * nDataVar;
                const Bytes before = noise(long{size[0]} * size[1] * size[2] * voxelSize);
                const Bytes expected = permuted(before, size.data(), perm, voxelSize);
                for (int start = 0; start < 8; ++start, dims = size) {
                    const Bytes data = worked(before, start, [&, type = type, n = nDataVar](void* at) {
                        EXPECT_TRUE(KpRawData::swapDims({at, type}, dims.data(), perm, n));
                    });
                    ASSERT_EQ(data, expected) << type.name() << perm[0] << perm[1] << '+' << start;
                    EXPECT_EQ(dims, (std::array{size[perm[0]], size[perm[1]], size[perm[2]]}));
                }
            }
}

TEST(SwapDims, changesNothingWhereItFails)
{
    Bytes data = noise(2 * 3 * 4 * 8);
    const Bytes before = data;
    int dims[3] = {2, 3, 4};
    const LogCapture log;
    for (const auto& perm : {std::array{0, 0, 1}, std::array{1, 2, 3}, std::array{-1, 0, 1}})
        EXPECT_FALSE(KpRawData::swapDims({data.data(), KpPrimType::Byte}, dims, perm.data(), 1));
    EXPECT_TRUE(log.lines().empty());
    EXPECT_FALSE(KpRawData::swapDims({data.data(), KpPrimType::Complex}, dims, perms[1], 1));
    EXPECT_FALSE(KpRawData::swapDims({data.data(), KpPrimType::UInt}, dims, perms[1], 2));
    EXPECT_EQ(log.lines().size(), 2U);
    for (const long n : {0, 1}) {  // the slice, the bits
        const FailingMalloc failing(n, 1);
        EXPECT_FALSE(KpRawData::swapDims({data.data(), KpPrimType::Byte}, dims, perms[3], 1));
    }
    EXPECT_EQ(std::tuple(data, dims[2]), std::tuple(before, 4));
    std::fill(data.begin(), data.end(), 7);
    EXPECT_TRUE(KpRawData::swapDims({data.data(), KpPrimType::Byte}, dims, perms[3], 1));
    EXPECT_EQ(dims[0], 4);  // constant: only the sizes change
}

TEST(TransposeKernels, agreeWithTheDefinition)
{
    for (const int size : {1, 2, 4, 8})
        for (const auto& path : kplib::detail::transposePaths(size))
            for (const int rows : {1, 2, 7, 16, 33, 70})
                for (const int columns : {1, 3, 8, 31, 32, 65}) {
                    const Bytes from = noise(long{rows} * columns * size);
                    const int dims[] = {columns, rows, 1}, start = (rows + columns) % 8;
                    worked(from, start, [&](void* at) {
                        const auto run = [&](void* to) { path.run(at, to, rows, columns); };
                        const Bytes to = worked(Bytes(from.size()), 7 - start, run);
                        ASSERT_EQ(to, permuted(from, dims, perms[2], size)) << path.name << size;
                    });
                }
}
