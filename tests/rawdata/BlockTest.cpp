#include "Elements.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/KpRawDataKernels.h>

#include <support/FailingMalloc.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <climits>
#include <cstdlib>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

using Sizes = std::array<int, 3>;
using Bytes = std::vector<std::uint8_t>;

long offset(const Sizes& dims, long x, long y, long z, long voxel)
{
    return ((z * dims[1] + y) * dims[0] + x) * voxel;
}

long volume(const Sizes& dims)
{
    return long{dims[0]} * dims[1] * dims[2];
}

/// Voxel by voxel: the one of the block, the fill value, or without one the nearest.
Bytes cropped(const Bytes& block, const Sizes& dims, const Sizes& min, const Sizes& max, long voxel, const void* fill)
{
    Bytes result;
    for (int z = min[2]; z <= max[2]; ++z)
        for (int y = min[1]; y <= max[1]; ++y)
            for (int x = min[0]; x <= max[0]; ++x) {
                const Sizes at = {std::clamp(x, 0, dims[0] - 1), std::clamp(y, 0, dims[1] - 1),
                                  std::clamp(z, 0, dims[2] - 1)};
                const auto* from = at == Sizes{x, y, z} || !fill ? block.data() + offset(dims, at[0], at[1], at[2], voxel)
                                                                 : static_cast<const std::uint8_t*>(fill);
                result.insert(result.end(), from, from + voxel);
            }
    return result;
}

/// A block of malloc, as crop() takes it.
struct Block {
    explicit Block(const Bytes& bytes) : data(std::malloc(bytes.size())) { std::memcpy(data, bytes.data(), bytes.size()); }
    ~Block() { std::free(data); }
    Bytes bytes(long n) const
    {
        const auto* first = static_cast<const std::uint8_t*>(data);
        return {first, first + n};
    }
    void* data;
};

}  // namespace

TEST(Flip, mirrorsVoxelsOfAnySize)
{
    const Sizes blocks[] = {{1, 1, 1}, {5, 4, 3}, {64, 3, 2}, {2, 1, 7}, {40001, 1, 1}, {33, 600, 2}};
    for (const Sizes& dims : blocks) {
        for (int voxel : {1, 2, 3, 4, 8, 12}) {
            const Bytes before = someValues<std::uint8_t>(volume(dims) * voxel, 9);
            for (int axis = 0; axis < 3; ++axis) {
                Bytes expected(before.size()), actual = before;
                for (int z = 0; z < dims[2]; ++z)
                    for (int y = 0; y < dims[1]; ++y)
                        for (int x = 0; x < dims[0]; ++x) {
                            Sizes from = {x, y, z};
                            from[axis] = dims[axis] - 1 - from[axis];
                            std::memcpy(&expected[offset(dims, x, y, z, voxel)],
                                        &before[offset(dims, from[0], from[1], from[2], voxel)], voxel);
                        }
                EXPECT_TRUE(KpRawData::flip(actual.data(), voxel, dims.data(), axis));
                EXPECT_TRUE(actual == expected) << dims[0] << ' ' << voxel << ' ' << axis;
            }
        }
    }
}

TEST(Flip, everyPathReverses)
{
    for (int width : {1, 2, 4, 8})
        for (long n : {0, 1, 63, 64, 65, 1001}) {
            const Bytes bytes = someValues<std::uint8_t>(n * width, 10);
            Bytes expected(bytes.size());
            for (long i = 0; i < n * width; ++i)
                expected[i] = bytes[(n - 1 - i / width) * width + i % width];
            for (const auto& path : reversePaths()) {
                Elements<std::uint8_t> src(bytes, 1), dst(n * width, 3);
                if (path.usable) {
                    path.run(width)(dst.data(), src.data(), n);
                    EXPECT_EQ(dst, expected) << path.name << ' ' << width << ' ' << n;
                }
            }
        }
}

TEST(Flip, refusals)
{
    int dims[] = {2, 1, 3};
    std::uint8_t data[] = {1, 2, 3, 4, 5, 6};
    EXPECT_FALSE(KpRawData::flip(data, 1, dims, 3));
    EXPECT_FALSE(KpRawData::flip(data, 1, dims, -1));
    EXPECT_FALSE(KpRawData::flip(nullptr, 1, dims, 0));
    {
        const FailingMalloc failing(0);
        EXPECT_FALSE(KpRawData::flip(data, 1, dims, 0));
        EXPECT_FALSE(KpRawData::flip(data, 1, dims, 2));
        EXPECT_TRUE(KpRawData::flip(data, 1, dims, 1)) << "a single voxel needs no exchange";
    }
    dims[0] = 0;
    EXPECT_FALSE(KpRawData::flip(data, 1, dims, 2));
    EXPECT_TRUE(std::ranges::equal(data, Bytes{1, 2, 3, 4, 5, 6}));
}

TEST(Crop, cutsAndExtends)
{
    const Sizes dims = {7, 5, 4};
    const std::uint8_t fill[] = {200, 201, 202, 203};
    std::mt19937 random(11);
    for (int i = 0; i < 600; ++i) {
        const int voxel = 1 + i % 4;
        const Bytes before = someValues<std::uint8_t>(volume(dims) * voxel, i);
        Sizes min, max, size = dims;
        for (int k = 0; k < 3; ++k) {  // a third of the boxes lies inside
            const int reach = i % 3 ? 6 : 0;
            min[k] = static_cast<int>(random() % (dims[k] + 2 * reach)) - reach;
            max[k] = min[k] + static_cast<int>(random() % (dims[k] + reach - min[k]));
        }
        Block block(before);
        const void* const value = i % 2 ? fill : nullptr;
        ASSERT_TRUE(KpRawData::crop(block.data, voxel, size.data(), min.data(), max.data(), value));
        const Bytes expected = cropped(before, dims, min, max, voxel, value);
        ASSERT_EQ(volume(size) * voxel, static_cast<long>(expected.size()));
        EXPECT_EQ(block.bytes(volume(size) * voxel), expected) << i;
    }
}

TEST(Crop, refusalsLeaveAllAsItWas)
{
    const Bytes before = {1, 2, 3, 4, 5, 6};
    const struct {
        Sizes dims, min, max;
        bool done, failing;
    } cases[] = {
        {{3, 2, 1}, {1, 0, 0}, {0, 1, 0}, false, false},             // empty
        {{3, 2, 1}, {2, 0, 0}, {0, 1, 0}, false, false},             // less than that
        {{3, 0, 1}, {0, 0, 0}, {2, 1, 0}, false, false},             // nothing to take from
        {{3, 2, 1}, {INT_MIN, 0, 0}, {INT_MAX, 1, 0}, false, false}, // more than an int holds
        {{3, 2, 1}, {0, 0, 0}, {3, 1, 0}, false, true},              // no memory
        {{3, 2, 1}, {0, 0, 0}, {2, 1, 0}, true, true},               // the block itself
    };
    for (const auto& c : cases) {
        Block block(before);
        void* const data = block.data;
        Sizes dims = c.dims;
        {
            const FailingMalloc failing(c.failing ? 0 : -1);
            EXPECT_EQ(KpRawData::crop(block.data, 1, dims.data(), c.min.data(), c.max.data(), nullptr), c.done);
        }
        EXPECT_TRUE(block.data == data && dims == c.dims && block.bytes(6) == before);
    }
}
