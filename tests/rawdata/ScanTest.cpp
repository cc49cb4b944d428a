#include "Elements.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/KpRawDataKernels.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <algorithm>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

/// Values whose extremes are zeros of both signs, or not, as the seed wants it.
template <typename T>
std::vector<T> valuesAboutZero(long n, unsigned seed)
{
    std::vector<T> values = someValues<T>(n, seed);
    for (long i = 0; i < n; ++i) {
        if (seed % 3 == 1 && !(values[i] >= T(1)))
            values[i] = i % 2 ? T(0) : -T(0);
        if (seed % 3 == 2 && !(values[i] <= T(0)))
            values[i] = i % 2 ? -T(0) : T(0);
        if (seed % 2 && i < n * 3 / 4 && values[i] == T(0))
            values[i] = seed % 3 == 1 ? T(1) : T(0);
    }
    return values;
}

template <typename T>
bool isNan(T v)
{
    return v != v;
}

}  // namespace

TEST(GetRange, everyPathFollowsTheSequentialSteps)
{
    eachType([]<typename T>(ElementTag<T>) {
        for (long n : {1, 2, 65, 127, 3000, 40001}) {
            for (unsigned seed = 0; seed < 12; ++seed) {
                const std::vector<T> values = valuesAboutZero<T>(n, seed);
                T expected[] = {values[0], values[0]};
                for (T v : values) {
                    if (expected[0] > v)
                        expected[0] = v;
                    else if (v > expected[1])
                        expected[1] = v;
                }
                for (const auto& path : rangePaths()) {
                    if (!path.usable)
                        continue;
                    Elements<T> elements(values, seed % 2);
                    T actual[] = {values[0], values[0]};
                    path.run(elements.typed().type)(elements.data(), n, &actual[0], &actual[1]);
                    EXPECT_EQ(std::memcmp(actual, expected, sizeof actual), 0)
                        << path.name << ' ' << elements.typed().type.name() << ' ' << n << ' ' << seed;
                }
            }
        }
    });
}

TEST(GetRange, answersInFloats)
{
    float min = -7, max = -7;
    float values[] = {1, 5, -2, 3};
    KpRawData::getRange({values, KpPrimType::Complex}, 2, min, max);
    EXPECT_TRUE(min == -2 && max == 5) << "parts of complex numbers share one range";
    KpRawData::getRange(values + 1, 0, min, max);
    EXPECT_TRUE(min == 5 && max == 5) << "the first is always read";
    std::int32_t large[] = {16777217, -16777217};
    KpRawData::getRange(large, 2, min, max);
    EXPECT_TRUE(min == -16777216 && max == 16777216);
    KpRawData::getRange({values, KpPrimType::String}, 1, min, max);
    EXPECT_TRUE(min == -16777216 && max == 16777216) << "left as it was";
}

TEST(IsConstant, everyPathFindsOneDifference)
{
    eachType([]<typename T>(ElementTag<T>) {
        const T constant = static_cast<T>(200.5);
        for (long n : {1, 2, 127, 1000}) {
            for (long different : {-1L, 0L, 1L, n / 2, n - 1}) {
                for (int step : {-1, 1}) {
                    std::vector<T> values(n, constant);
                    if (different >= 0 && different < n)
                        values[different] = static_cast<T>(constant + step);
                    const bool differs = std::count(values.begin(), values.end(), values[0]) != n;
                    Elements<T> elements(values, 1);
                    EXPECT_EQ(KpRawData::isConstant(elements.typed(), n), !differs);
                    for (const auto& path : differsPaths()) {
                        if (path.usable) {
                            EXPECT_EQ(path.run(elements.typed().type)(elements.data(), n, &values[0]), differs)
                                << path.name << ' ' << elements.typed().type.name() << ' ' << n << ' ' << different;
                        }
                    }
                }
            }
        }
    });
}

TEST(IsConstant, oddCases)
{
    const float nan = std::numeric_limits<float>::quiet_NaN();
    std::vector<float> values(1000, 0.0f);
    values[3] = -0.0f;
    values[500] = values[999] = nan;
    EXPECT_TRUE(KpRawData::isConstant(values.data(), 1000)) << "zeros are equal, and NaN behind the head is skipped";
    EXPECT_FALSE(KpRawData::isConstant(values.data() + 500, 1)) << "NaN at the head";
    float pair[] = {1, 2};
    EXPECT_FALSE(KpRawData::isConstant({pair, KpPrimType::Complex}, 1));
    EXPECT_TRUE(KpRawData::isConstant({nullptr, KpPrimType::Complex}, 0));
    EXPECT_FALSE(KpRawData::isConstant({pair, KpPrimType::SByte}, 1));
}

TEST(Memset, cutsIntegersAndRoundsReals)
{
    const double huge = 3e9, nan = std::numeric_limits<double>::quiet_NaN();
    const struct {
        double value;
        std::int64_t stored;  // before it is cut to the width
    } cases[] = {{2.5, 3},    {-2.5, -2},         {-2.51, -3},       {300.0, 300},      {70000.4, 70000},
                 {huge, INT32_MIN}, {-huge, INT32_MIN}, {nan, INT32_MIN}, {2147483647.4, INT32_MAX}};
    eachType([&]<typename T>(ElementTag<T>) {
        for (const auto& c : cases) {
            const T expected = std::is_integral_v<T> ? static_cast<T>(c.stored) : static_cast<T>(c.value);
            Elements<T> elements(101, 1);
            KpRawData::memset(elements.typed(), c.value, 101);
            EXPECT_EQ(elements, std::vector<T>(101, expected)) << elements.typed().type.name() << ' ' << c.value;
        }
        Elements<T> elements(2);
        KpRawData::memset(elements.typed(), -1000, 2);
        KpRawData::memset(elements.typed(), 5, -1);
        EXPECT_EQ(elements, std::vector<T>(2, static_cast<T>(-1000)));
        Elements<T> large((9L << 20) / sizeof(T), sizeof(T));
        KpRawData::memset(large.typed(), 77, large.size());
        EXPECT_EQ(large, std::vector<T>(large.size(), T(77)));
    });
    const LogCapture log;
    double untouched = 1;
    KpRawData::memset({&untouched, KpPrimType::UInt}, 5, 1);
    KpRawData::memset({&untouched, KpPrimType::Complex}, 5.0, 1);
    ASSERT_EQ(log.lines().size(), 2u);
    EXPECT_TRUE(log.lines()[0].ends_with("Unsupported data type uint in KpRawData::memset()\n"));
    EXPECT_TRUE(log.lines()[1].ends_with("Unsupported data type complex in KpRawData::memset()\n"));
    EXPECT_EQ(untouched, 1);
}

TEST(SwapBytes, reversesTheBytesOfEachWord)
{
    for (int width : {2, 4, 8}) {
        for (long n : {0, 1, 31, 32, 1001}) {
            const auto bytes = someValues<std::uint8_t>(n * width, 6);
            auto expected = bytes;
            for (long i = 0; i < n; ++i)
                std::reverse(expected.begin() + i * width, expected.begin() + (i + 1) * width);
            for (const auto& path : swapPaths()) {
                if (!path.usable)
                    continue;
                Elements<std::uint8_t> words(bytes, 1);
                path.run(width)(words.data(), n);
                EXPECT_EQ(words, expected) << path.name << ' ' << width << ' ' << n;
            }
        }
    }
    const int widths[KpPrimType::NumTypes] = {1, 2, 4, 4, 8, 4, 4, 2, 4, 1};  // of what is reversed in each type
    for (int type = 0; type < KpPrimType::NumTypes; ++type) {
        const auto bytes = someValues<std::uint8_t>(16, 7);
        auto expected = bytes;
        for (long i = 0; i < 16; i += widths[type])
            std::reverse(expected.begin() + i, expected.begin() + i + widths[type]);
        Elements<std::uint8_t> words(bytes, 0);
        KpRawData::swapBytes({words.data(), KpPrimType(type)}, static_cast<unsigned long>(16 / KpPrimType(type).size()));
        EXPECT_EQ(words, expected) << type;
    }
    const LogCapture log;
    KpRawData::swapBytes({nullptr, KpPrimType(12)}, 1);
    ASSERT_EQ(log.lines().size(), 1u);
    EXPECT_TRUE(log.lines()[0].ends_with("Swapping of 0-byte words not supported."));
}
