#include <kplib/foundation/KpMemory.h>
#include <kplib/foundation/KpMemoryException.h>
#include <kplib/volume/KpConnectedComponents.h>
#include <kplib/volume/detail/FloatSums.h>
#include <kplib/volume/detail/LabelPlainly.h>
#include <support/FailingMalloc.h>
#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <limits>
#include <random>

using namespace kplib::detail;
using CC = KpConnectedComponents;

namespace {

struct Dims {
    int of[3];
    long n() const { return nVoxelsOf(of); }
};

/// do_label() against its definition: result, all of the label image, counters and the table to the bit.
template <typename T, typename L = unsigned short>
int expectAsDefined(std::vector<T> data, Dims dims, T low, T high, int neighbours, int labelMode)
{
    std::vector<L> expected(data.size(), 77), labels = expected;
    ComponentTable expectedTable, table{Component{5, 5, 5, {5, 5, 5}}};
    const int count =
        PlainLabelling<T, L>(data.data(), expected.data(), expectedTable, low, high, dims.of, neighbours, labelMode)
            .run();
    const int added = CC::dbg_add, cleaned = CC::dbg_clean;
    EXPECT_EQ(CC::do_label(data.data(), labels.data(), table, low, high, dims.of, neighbours, labelMode), count);
    EXPECT_TRUE(labels == expected);
    EXPECT_EQ(std::tuple(CC::dbg_add, CC::dbg_clean, CC::dbg_merge), std::tuple(added, cleaned, 0));
    EXPECT_EQ(table.size(), expectedTable.size());
    EXPECT_EQ(std::memcmp(table.data(), expectedTable.data(), sizeof(Component) * table.size()), 0);
    if constexpr (std::is_same_v<T, L>) {
        if (labelMode == 0) {  // labels in place of the values
            EXPECT_EQ(CC::do_label(data.data(), data.data(), table, low, high, dims.of, neighbours, 0), count);
            EXPECT_EQ(std::memcmp(table.data(), expectedTable.data(), sizeof(Component) * table.size()), 0);
        }
    }
    return count;
}

template <typename Shape>
std::vector<unsigned char> draw(Dims dims, Shape shape)
{
    std::vector<unsigned char> data;
    for (int z = 0; z < dims.of[2]; ++z)
        for (int y = 0; y < dims.of[1]; ++y)
            for (int x = 0; x < dims.of[0]; ++x)
                data.push_back(shape(x, y, z) ? 1 : 0);
    return data;
}

/// Values 0 to 3 in runs along x, foreground with the given share; NaN among real numbers.
template <typename T>
std::vector<T> noise(Dims dims, double density, int run, unsigned seed)
{
    std::minstd_rand random(seed);
    std::vector<T> data;
    T value = 0;
    while (static_cast<long>(data.size()) < dims.n()) {
        if (random() % static_cast<unsigned>(run) == 0 || data.empty()) {
            const bool isSet = std::generate_canonical<double, 30>(random) < density;
            value = isSet ? static_cast<T>(1 + random() % 3) : T(0);
            if (std::numeric_limits<T>::has_quiet_NaN && random() % 16 == 0)
                value = std::numeric_limits<T>::quiet_NaN();
        }
        data.push_back(value);
    }
    return data;
}

template <typename T, typename L>
void expectNoiseAsDefined()
{
    unsigned seed = 0;
    const int sizes[][3] = {{1, 1, 1},  {1, 7, 3},  {8, 5, 3},  {9, 4, 3},  {31, 3, 2},
                            {32, 1, 5}, {70, 2, 1}, {64, 5, 4}, {131, 9, 6}};
    for (const auto& [nx, ny, nz] : sizes)
        for (double density : {0.001, 0.1, 0.5, 0.9, 0.999})
            for (int run : {1, 12})
                for (int neighbours : {4, 5, 6, 8, 10, 18, 26})
                    for (int labelMode : {0, 1}) {
                        const Dims dims{{nx, ny, nz}};
                        SCOPED_TRACE(testing::Message()
                                     << nx << ", " << density << ' ' << run << ' ' << neighbours << ' ' << labelMode);
                        expectAsDefined<T, L>(noise<T>(dims, density, run, ++seed), dims, 1, 3, neighbours, labelMode);
                    }
}

std::vector<double> valuesOf(const Component& c)
{
    return {1. * c.id, 1. * c.nVoxels, 1. * c.nSeeds, c.sum[0], c.sum[1], c.sum[2]};
}

/// Labels, as digits, of a plane given as text; any but ' ' is foreground.
std::string labelled(const std::string& picture, int width, int neighbours, double low = '!')
{
    const int dims[3] = {width, static_cast<int>(picture.size()) / width, 1};
    std::vector<unsigned char> data(picture.begin(), picture.end());
    std::vector<unsigned short> labels(data.size());
    unsigned short* address = labels.data();
    CC::labelCC(data.data(), dims, neighbours, address, 0, low, 255, 0, 0, nullptr);
    std::string result;
    for (int label : labels)
        result += static_cast<char>('0' + label);
    return result;
}

}  // namespace

TEST(KpConnectedComponents, isAsDefinedOnNoise)
{
    expectNoiseAsDefined<unsigned char, unsigned short>();
    expectNoiseAsDefined<unsigned char, int>();
    expectNoiseAsDefined<unsigned short, unsigned short>();
    expectNoiseAsDefined<int, unsigned short>();
    expectNoiseAsDefined<float, unsigned short>();
    expectNoiseAsDefined<double, unsigned short>();
}

TEST(FloatSums, equalOneAdditionAfterTheOther)
{
    std::mt19937 random(4);
    const auto upTo = [&](int bits) { return static_cast<long>(random() >> (32 - 1 - random() % unsigned(bits))); };
    for (int i = 0; i < 100000; ++i) {
        const float start = std::ldexp(static_cast<float>(random() >> 8), static_cast<int>(random() % 20));
        const long x = upTo(14), y = upTo(14), z = upTo(25), n = upTo(9);
        float sum[3] = {start, start, start}, expected[3] = {start, start, start};
        addRowTo(sum, x, y, z, n);
        for (long k = 0; k < n; ++k) {
            expected[0] += static_cast<float>(x + k);
            expected[1] += static_cast<float>(y);
            expected[2] += static_cast<float>(z);
        }
        ASSERT_EQ(std::memcmp(sum, expected, sizeof sum), 0) << start << ": " << x << ' ' << y << ' ' << z << ' ' << n;
    }
}

TEST(KpConnectedComponents, cleansUpAtTheLimitAndFailsWithoutRoom)
{
    // Rows of dots, each joined by the full line below it.
    const Dims dims{{1000, 420, 1}};
    const auto lines = draw(dims, [](int x, int y, int) { return y % 3 == 2 || (y % 3 == 1 && x % 2 != 0); });
    EXPECT_EQ(expectAsDefined<unsigned char>(lines, dims, 1, 1, 4, 0), 140);
    EXPECT_EQ(CC::dbg_clean, 2);

    const kplib::test::LogCapture log(KpLogError);
    const auto board = draw(dims, [](int x, int y, int) { return (x + y) % 2; });
    EXPECT_EQ(expectAsDefined<unsigned char>(board, dims, 1, 1, 6, 0), -1);
    EXPECT_EQ(log.lines(), kplib::test::Lines(2, "E [] ERROR: too many components"));
    EXPECT_EQ((expectAsDefined<unsigned char, int>(board, dims, 1, 1, 6, 0)), 210000);
    // Few of the many aliases of noise are left at the end of its clean-ups.
    expectAsDefined<unsigned char>(noise<unsigned char>({{1300, 700, 1}}, 0.5, 1, 3), {{1300, 700, 1}}, 1, 1, 4, 0);
}

TEST(KpConnectedComponents, startsFromZeroAndKeepsScratchSmall)
{
    ComponentTable table{Component{5, 5, 5, {5, 5, 5}}};
    table.resize(0);
    table.resize(1);
    EXPECT_EQ(valuesOf(table[0]), std::vector<double>(6));
    for (const int width : {1, 7, 8}) {
        const int dims[] = {width, 100, 1};
        std::vector<unsigned char> data(static_cast<std::size_t>(width) * 100);
        std::vector<unsigned short> labels(data.size());
        const kplib::test::FailingMalloc counting(-1);
        CC::do_label<unsigned char>(data.data(), labels.data(), table, 1, 1, dims, 26, 0);
        EXPECT_EQ(counting.count(), width < 8 ? 1 : 2) << "the clean-up, and the bits of rows";
    }
}

TEST(KpConnectedComponents, joinsByNeighbourhood)
{
    EXPECT_EQ(labelled("#  #", 2, 4), "1002");
    EXPECT_EQ(labelled("#  #", 2, 8), "1001");
    EXPECT_EQ(labelled("###", 3, 5), "123");
    EXPECT_EQ(labelled("# # #  ####    ", 5, 4), "102020022230000");
    for (auto [neighbours, count] : {std::pair{26, 1}, {18, 2}, {6, 2}, {10, 2}}) {
        const Dims dims{{2, 2, 2}};
        EXPECT_EQ(expectAsDefined<short>({1, 0, 0, 0, 0, 0, 0, 1}, dims, 1, 1, neighbours, 0), count) << neighbours;
    }
}

TEST(KpConnectedComponents, measuresComponents)
{
    short data[] = {5, 0, 9,  //
                    5, 9, 9};
    const int dims[] = {3, 2, 1}, empty[] = {3, 2, 0};
    unsigned short* labels = nullptr;
    ComponentTable table;
    EXPECT_EQ(CC::labelCC(data, dims, 4, labels, 0, 0.5, 9, 0, 0, &table), 1);
    ASSERT_NE(labels, nullptr);
    EXPECT_EQ(table.size(), 2);
    EXPECT_EQ(valuesOf(table[1]), (std::vector<double>{1, 5, 3, 5, 3, 0}));
    EXPECT_EQ(CC::labelCC(data, empty, 4, labels, 0, 1, 9, 0, 0, &table), 0);
    kpfree(labels);

    unsigned char values[] = {0, 0, 7, 3, 3, 7};
    std::vector<int> huge(6);
    EXPECT_EQ(CC::labelLabelsHuge(values, dims, 8, huge.data(), 0, 0, table), 3);
    EXPECT_EQ(huge, (std::vector<int>{1, 1, 2, 3, 3, 2}));
    EXPECT_EQ(std::tuple(table[1].nSeeds, table[2].nSeeds, table[3].nSeeds), std::tuple(0U, 7U, 3U));
    std::vector<unsigned short> few(6);
    EXPECT_EQ(CC::labelLabels(values, dims, 4, few.data(), 0, 0, table), 3);
    EXPECT_EQ(CC::compareComponents(table[0], table[1]), -1);
    EXPECT_EQ(CC::compareComponents(table[1], table[2]), 0);
}

// Half up, then cut to an int (none that fits is the smallest), then to the element type.
TEST(KpConnectedComponents, roundsThresholds)
{
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const std::pair<double, const char*> cases[] = {{10.4, "0011"},  {10.5, "0001"},   {266, "0011"},
                                                    {1e300, "1111"}, {-1e300, "1111"}, {nan, "1111"}};
    for (const auto& [low, labels] : cases) {
        EXPECT_EQ(labelled({0, 9, 10, 11}, 4, 4, low), labels) << low;
    }
}

TEST(KpConnectedComponents, refusesWhatIsNoNumber)
{
    const kplib::test::LogCapture log(KpLogError);
    const int dims[] = {1, 1, 1}, huge[] = {1 << 22, 1 << 22, 1 << 22};  // 2^66 voxels are not none
    unsigned short* none = nullptr;
    EXPECT_THROW(CC::labelCC({none, KpPrimType::Short}, huge, 6, none, 0, 0, 0, 0, 0, nullptr), KpMemoryException);
    unsigned short label = 0, *labels = &label;
    ComponentTable table{Component{5, 5, 5, {5, 5, 5}}};
    EXPECT_EQ(CC::labelCC({&label, KpPrimType::Complex}, dims, 4, labels, 0, 1, 1, 0, 0, &table), -1);
    EXPECT_EQ(table[0].id, 5);
    EXPECT_EQ(log.lines(), kplib::test::Lines{"E [] Unsupported data type complex in KpRawData()\n"});
}

TEST(KpConnectedComponents, cleansUpAliasesAndSmallOnes)
{
    ComponentTable table;
    for (int id : {0, 1, 1, 3, 3, 5})
        table.append(Component{id, static_cast<unsigned>(id), static_cast<unsigned>(id), {0, 0, 0}});
    ComponentTable another = table;
    std::vector<unsigned short> labels{5, 4, 3, 2, 1, 0, 5};
    EXPECT_EQ(CC::addNewComponent(table, labels.data(), 6), 6);
    table.resize(6);
    EXPECT_EQ(CC::cleanup_components(table, labels.data(), 6, 3, -1), 3);
    EXPECT_EQ(labels, (std::vector<unsigned short>{2, 1, 1, 0, 0, 0, 5}));
    EXPECT_EQ(valuesOf(table[2]), (std::vector<double>{2, 5, 5, 0, 0, 0}));
    int huge[] = {5, 3};
    EXPECT_EQ(CC::cleanup_components(another, huge, 2, -1, 5), 2);
    EXPECT_EQ(huge[0] * 10 + huge[1], 10);

    Component nonRoot{1, 1, 2, {1, 2, 3}}, other{7, 10, 20, {10, 20, 30}};
    nonRoot.addAlias(other, 1);
    EXPECT_EQ(valuesOf(nonRoot), (std::vector<double>{1, 11, 2, 11, 22, 33}));
    EXPECT_EQ(valuesOf(other), (std::vector<double>{1, 0, 0, 0, 0, 0}));
}
