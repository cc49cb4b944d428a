#include <kplib/volume/KpMorphology.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <array>
#include <limits>
#include <random>
#include <vector>

using Field = KpBitfield;

namespace {

/// The walk of the fill bit by bit, with every segment on the stack.
struct PlainFill {
    const Field& src;
    Field& dst;
    bool value;
    int nx, ny, nz;
    unsigned long count = 0;
    std::array<int, 6> box{};
    std::vector<std::array<int, 4>> stack{};

    unsigned long at(int x, int y, int z) const { return (static_cast<unsigned long>(z) * ny + y) * nx + x; }
    bool isOn(int x, int y, int z) const { return src.test(at(x, y, z)) == value; }
    bool isSet(int x, int y, int z) const { return dst.test(at(x, y, z)); }

    void pushAround(int z, int y, int left, int right)
    {
        const int around[][2] = {{z - 1, y}, {z + 1, y}, {z, y - 1}, {z, y + 1}};
        for (const auto& [atZ, atY] : around)
            if (atZ >= 0 && atZ < nz && atY >= 0 && atY < ny)
                stack.push_back({atZ, atY, left, right});
    }
    void extend(int left, int right, int y, int z)
    {
        box = {std::min(box[0], left), std::max(box[1], right), std::min(box[2], y),
               std::max(box[3], y),    std::min(box[4], z),     std::max(box[5], z)};
    }

    void seed(int x, int y, int z, bool isFirst)
    {
        if (isFirst)
            box = {x, x, y, y, z, z};
        extend(x, x, y, z);
        if (x < 0 || x >= nx || y < 0 || y >= ny || z < 0 || z >= nz || !isOn(x, y, z))
            return;
        pushAround(z, y, x, x);
        stack.push_back({z, y, x, x});
        while (!stack.empty()) {
            const auto [sz, sy, left, right] = stack.back();
            stack.pop_back();
            walk(sz, sy, left, right);
        }
    }

    void walk(int z, int y, int x, int right)
    {
        for (bool isFirst = true; x <= right; isFirst = false) {
            if (isOn(x, y, z))
                while (x < right && isSet(x, y, z))
                    ++x;
            if (!isOn(x, y, z)) {
                ++x;
            } else if (isSet(x, y, z)) {
                return;
            } else {
                int from = x, to = x;
                while (isFirst && from > 0 && isOn(from - 1, y, z))
                    --from;
                while (to < nx - 1 && isOn(to + 1, y, z))
                    ++to;
                dst.setRange(at(from, y, z), at(to, y, z));
                count += static_cast<unsigned long>(to - from + 1);
                extend(from, to, y, z);
                pushAround(z, y, from, to);
                x = to + 2;
            }
            while (x <= right && !isOn(x, y, z))
                ++x;
        }
    }
};

Field noise(unsigned long nBits, double density, std::mt19937& random)
{
    Field field(nBits, Field::INIT_UNSET);
    for (unsigned long i = 0; i < nBits; ++i)
        if (std::bernoulli_distribution(density)(random))
            field.set(i);
    return field;
}

void compareWithWalk(const std::array<int, 3>& dims, double density, double visited, std::mt19937& random)
{
    const unsigned long nBits = static_cast<unsigned long>(dims[0]) * dims[1] * dims[2];
    const Field src = noise(nBits, density, random);
    Field dst = noise(nBits, visited, random), expected = dst;
    const bool value = random() % 4 != 0;
    KpDArray<KpVec3i> seeds;
    PlainFill plain{src, expected, value, dims[0], dims[1], dims[2]};
    for (int i = 0; i < 3; ++i) {
        int at[3];
        for (int axis = 0; axis < 3; ++axis)
            at[axis] = static_cast<int>(random() % (dims[axis] + 2U)) - 1;  // some outside
        seeds.append({at[0], at[1], at[2]});
        plain.seed(at[0], at[1], at[2], i == 0);
    }
    std::array<int, 6> box{};
    const unsigned long count = KpMorphology::floodfill(src, dst, seeds, value, dims.data(), box.data());
    ASSERT_EQ(count, plain.count);
    ASSERT_EQ(dst, expected);
    ASSERT_EQ(box, plain.box);
}

TEST(FloodFill, equalsTheWalkBitByBit)
{
    std::mt19937 random(57);
    for (const auto& dims :
         {std::array{1, 1, 1}, {3, 3, 3}, {5, 4, 1}, {32, 1, 2}, {17, 9, 5}, {64, 6, 3}, {181, 5, 4}})
        for (double density : {0.3, 0.6, 0.9, 0.99, 1.0})
            for (double visited : {0.0, 0.0, 0.1, 0.5}) {
                SCOPED_TRACE(testing::Message() << dims[0] << ' ' << dims[1] << ' ' << density << ' ' << visited);
                for (int round = 0; round < 3; ++round)
                    compareWithWalk(dims, density, visited, random);
            }
}

TEST(FloodFill, refusesWhatItCannotWorkOn)
{
    const kplib::test::LogCapture log;
    const Field src(32769, Field::INIT_SET), most16(32768, Field::INIT_SET);
    Field dst;
    int box[6] = {1, 2, 3, 4, 5, 6};
    const int most = std::numeric_limits<int>::max();
    for (const auto& dims :
         {std::array{32769, 1, 1}, {1, 32769, 1}, {1, 1, 32769}, {32767, 1, 1}, {0, 1, 1}, {most, most, most}})
        EXPECT_EQ(KpMorphology::floodfill(src, dst, {{0, 0, 0}}, true, dims.data(), box), 0UL);
    EXPECT_EQ(log.lines().size(), 3U) << "the others are of another size, which is not logged";
    EXPECT_EQ(dst.nBits(), 0UL);
    const int dims[] = {2, 16384, 1};
    EXPECT_EQ(KpMorphology::floodfill(most16, dst, {}, true, dims, box), 0UL);
    EXPECT_EQ(std::tuple(dst.nBits(), std::to_array(box)), std::tuple(32768, std::array{1, 2, 3, 4, 5, 6}));
    EXPECT_EQ(KpMorphology::floodfill(most16, dst, {{1, 16383, 0}}, true, dims, box), 32768UL);
    for (const auto& longest : {std::array{32768, 1, 1}, {1, 32768, 1}, {1, 1, 32768}}) {
        Field fresh;
        EXPECT_EQ(KpMorphology::floodfill(most16, fresh, {{0, 0, 0}}, true, longest.data(), box), 32768UL);
        EXPECT_EQ(std::max({box[1], box[3], box[5]}), 32767);
    }
}

}  // namespace
