#include "Elements.h"

#include <support/FailingMalloc.h>

#include <climits>
#include <cstdlib>
#include <memory>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

using Sizes = std::array<int, 3>;

long offset(const Sizes& dims, const Sizes& at, int voxel)
{
    return ((long{at[2]} * dims[1] + at[1]) * dims[0] + at[0]) * voxel;
}

/// The voxels from `min` to `max`, one by one from where `place` says.
template <typename Place>
Bytes taken(const Sizes& min, const Sizes& max, int voxel, Place place)
{
    Bytes result;
    for (int z = min[2]; z <= max[2]; ++z)
        for (int y = min[1]; y <= max[1]; ++y)
            for (int x = min[0]; x <= max[0]; ++x) {
                const std::uint8_t* from = place(Sizes{x, y, z});
                result.insert(result.end(), from, from + voxel);
            }
    return result;
}

}  // namespace

TEST(Flip, mirrorsVoxelsOfAnySize)
{
    for (const Sizes& dims : {Sizes{1, 1, 1}, {5, 4, 3}, {64, 3, 2}, {2, 1, 7}, {40001, 1, 1}, {33, 600, 2}})
        for (int voxel : {1, 2, 3, 4, 8, 12})
            for (int axis = 0; axis < 3; ++axis) {
                const Sizes last = {dims[0] - 1, dims[1] - 1, dims[2] - 1};
                const Bytes before = someValues<std::uint8_t>(offset(dims, last, voxel) + voxel, 9);
                const Bytes expected = taken({0, 0, 0}, last, voxel, [&](Sizes at) {
                    at[axis] = last[axis] - at[axis];
                    return &before[offset(dims, at, voxel)];
                });
                Bytes actual = before;
                EXPECT_TRUE(KpRawData::flip(actual.data(), voxel, dims.data(), axis));
                EXPECT_TRUE(actual == expected) << dims[0] << ' ' << voxel << ' ' << axis;
            }
}

TEST(Flip, everyPathReverses)
{
    for (int width : {1, 2, 3, 4, 8})
        for (long n : {0, 1, 63, 64, 65, 1001}) {
            const Bytes bytes = someValues<std::uint8_t>(n * width, 10);
            Bytes expected(bytes.size());
            for (long i = 0; i < n * width; ++i)
                expected[i] = bytes[(n - 1 - i / width) * width + i % width];
            expectOfEachPath(reversePaths(), expected, bytes,
                             [=](auto loops, void* dst, void* src) { loops(width)(dst, src, n); });
        }
}

TEST(Flip, refusals)
{
    const Bytes before = {1, 2, 3, 4, 5, 6};
    // clang-format off
    const struct { Sizes dims; int axis; bool isNull, done; } cases[] = {
        {{2, 1, 3}, 3, false, false}, {{2, 1, 3}, -1, false, false}, {{2, 1, 3}, 1, true, false},
        {{0, 1, 3}, 1, false, false}, {{2, 1, -3}, 1, false, false}, {{2, 1, 3}, 0, false, false},  // no memory
        {{2, 1, 3}, 1, false, true}};                                // a single voxel needs no exchange
    // clang-format on
    for (const auto& [dims, axis, isNull, done] : cases) {
        Bytes data = before;
        const FailingMalloc failing(0);
        EXPECT_EQ(KpRawData::flip(isNull ? nullptr : data.data(), 1, dims.data(), axis), done);
        EXPECT_TRUE(data == before);
    }
}

TEST(Crop, cutsAndExtends)
{
    const Sizes dims = {7, 5, 4};
    const std::uint8_t fill[] = {200, 201, 202, 203};
    std::mt19937 random(11);
    for (int i = 0; i < 600; ++i) {
        const int voxel = 1 + i % 4, reach = i % 3 ? 9 : 0;  // a third of the boxes lies inside, some wholly outside
        const Bytes before = someValues<std::uint8_t>(140 * voxel, i);
        Sizes min, max, size = dims;
        for (int k = 0; k < 3; ++k) {
            min[k] = int(random() % (dims[k] + 2 * reach)) - reach;
            max[k] = min[k] + int(random() % std::max(1, dims[k] + reach - min[k]));
        }
        const Bytes expected = taken(min, max, voxel, [&](const Sizes& at) {
            Sizes nearest;
            for (int k = 0; k < 3; ++k)
                nearest[k] = std::clamp(at[k], 0, dims[k] - 1);
            return nearest == at || i % 2 ? &before[offset(dims, nearest, voxel)] : fill;
        });
        void* data = std::malloc(before.size());
        std::memcpy(data, before.data(), before.size());
        EXPECT_TRUE(KpRawData::crop(data, voxel, size.data(), min.data(), max.data(), i % 2 ? nullptr : fill));
        const std::unique_ptr<void, decltype(&std::free)> owner(data, std::free);
        ASSERT_EQ(long{size[0]} * size[1] * size[2] * voxel, long(expected.size()));
        EXPECT_EQ(std::memcmp(data, expected.data(), expected.size()), 0) << i;
    }
}

TEST(Crop, refusalsLeaveAllAsItWas)
{
    const Bytes before = {1, 2, 3, 4, 5, 6};
    // clang-format off
    const struct { Sizes dims, min, max; bool done, failing; } cases[] = {
        {{3, 2, 1}, {1, 0, 0}, {0, 1, 0}, false, false},              // empty
        {{3, 0, 1}, {0, 0, 0}, {2, 1, 0}, false, false},              // nothing to take from
        {{3, 2, 1}, {INT_MIN, 0, 0}, {INT_MAX, 1, 0}, false, false},  // more than an int holds
        {{3, 2, 1}, {0, 0, 0}, {3, 1, 0}, false, true},               // no memory
        {{3, 2, 1}, {0, 0, 0}, {2, 1, 0}, true, true}};               // the block itself
    // clang-format on
    for (const auto& c : cases) {
        Bytes block = before;
        void* data = block.data();
        Sizes dims = c.dims;
        const FailingMalloc failing(c.failing ? 0 : -1);
        EXPECT_EQ(KpRawData::crop(data, 1, dims.data(), c.min.data(), c.max.data(), nullptr), c.done);
        EXPECT_EQ(data, block.data());
        EXPECT_EQ(dims, c.dims);
        EXPECT_EQ(block, before);
    }
}
