#include "Elements.h"

using namespace kplib::test;
using namespace kplib::detail;

TEST(GetRange, everyPathFollowsTheSequentialSteps)
{
    eachType([]<typename T>(KpElementTag<T>) {
        for (long n : {1, 2, 65, 127, 3000, 40001})
            for (unsigned seed = 0; seed < 12; ++seed) {
                auto values = someValues<T>(n, seed);
                const T sign = static_cast<T>(seed % 3 == 1 ? 1 : -1);
                for (long i = 0; std::is_floating_point_v<T> && seed % 3 && i < n; ++i)  // a zero is an extreme
                    if (!(values[i] * sign >= 1))
                        values[i] = seed % 2 && i < n * 3 / 4 ? sign : static_cast<T>(i % 2 ? 0.0 : -0.0);
                std::vector<T> expected = {values[0], values[0]};
                for (T v : values) {
                    if (expected[0] > v)
                        expected[0] = v;
                    else if (v > expected[1])
                        expected[1] = v;
                }
                expectOfEachPath(rangePaths(), expected, values, [&](auto loops, void* dst, void* src) {
                    T range[] = {values[0], values[0]};
                    loops(typeOf<T>)(src, n, &range[0], &range[1]);
                    std::memcpy(dst, range, sizeof range);
                });
            }
    });
}

TEST(GetRange, answersInFloats)
{
    float values[] = {1, 5, -2, 3}, min = -7, max = -7;
    std::int32_t large[] = {16777217, -16777217};
    KpRawData::getRange({values, KpPrimType::Complex}, 2, min, max);
    EXPECT_EQ(std::tuple(min, max), std::tuple(-2.F, 5.F)) << "parts of complex numbers share one range";
    KpRawData::getRange(values + 1, 0, min, max);
    EXPECT_EQ(std::tuple(min, max), std::tuple(5.F, 5.F)) << "the first is always read";
    KpRawData::getRange(large, 2, min, max);
    KpRawData::getRange({values, KpPrimType::String}, 1, min, max);
    EXPECT_EQ(std::tuple(min, max), std::tuple(-16777216.F, 16777216.F)) << "left as it was";
}

TEST(IsConstant, everyPathFindsOneDifference)
{
    eachType([]<typename T>(KpElementTag<T>) {
        for (long n : {1, 2, 127, 1000})
            for (long different : {0L, 1L, n / 2, n - 1})
                for (int step : {-1, 0, 1}) {
                    std::vector<T> values(n, static_cast<T>(200.5));
                    values[different % n] = static_cast<T>(values[0] + step);
                    const bool differs = std::count(values.begin(), values.end(), values[0]) != n;
                    EXPECT_EQ(KpRawData::isConstant(values.data(), n), !differs);
                    expectOfEachPath(differsPaths(), Bytes{differs}, values, [&](auto loops, void* dst, void* src) {
                        *static_cast<std::uint8_t*>(dst) = loops(typeOf<T>)(src, n, &values[0]);
                    });
                }
    });
}

TEST(IsConstant, oddCases)
{
    std::vector<float> values(1000, 0.0f);
    values[3] = -0.0f;
    values[500] = values[999] = NAN;
    float pair[] = {1, 2};
    EXPECT_TRUE(KpRawData::isConstant(values.data(), 1000)) << "zeros are equal, and NaN behind the head is skipped";
    EXPECT_FALSE(KpRawData::isConstant(values.data() + 500, 1)) << "NaN at the head";
    EXPECT_FALSE(KpRawData::isConstant({pair, KpPrimType::Complex}, 1));
    EXPECT_FALSE(KpRawData::isConstant({values.data(), KpPrimType::SByte}, 1));
}

TEST(Memset, cutsIntegersAndRoundsReals)
{
    // clang-format off
    const struct { double value; std::int64_t stored; } cases[] = {  // stored before it is cut to the width
        {2.5, 3}, {-2.5, -2}, {-2.51, -3}, {300.0, 300}, {70000.4, 70000}, {3e9, INT32_MIN}, {-3e9, INT32_MIN},
        {NAN, INT32_MIN}, {2147483647.4, INT32_MAX}};
    // clang-format on
    eachType([&]<typename T>(KpElementTag<T>) {
        const auto expectFilled = [](auto value, T expected, long n, long start) {
            const auto fill = [=](void* to) {
                KpRawData::memset({to, typeOf<T>}, value, n);
                KpRawData::memset({to, typeOf<T>}, 5, -1);
            };
            EXPECT_TRUE(areSame(worked(std::vector<T>(n), start, fill), std::vector<T>(n, expected))) << value;
        };
        for (const auto& [value, stored] : cases)
            expectFilled(value, std::is_integral_v<T> ? T(stored) : T(value), 101, 1);
        expectFilled(77, T(77), (9L << 20) / sizeof(T), sizeof(T));
    });
    const auto error = logged([] { KpRawData::memset({nullptr, KpPrimType::UInt}, 5, 1); });
    EXPECT_EQ(error, "E Unsupported data type uint in KpRawData::memset()\n");
}

TEST(SwapBytes, reversesTheBytesOfEachWord)
{
    const auto swapped = [](Bytes bytes, long width) {
        for (auto word = bytes.begin(); word != bytes.end(); word += width)
            std::reverse(word, word + width);
        return bytes;
    };
    for (int width : {2, 4, 8})
        for (long n : {0, 1, 31, 32, 1001}) {
            const Bytes bytes = someValues<std::uint8_t>(n * width, 6);
            expectOfEachPath(swapPaths(), swapped(bytes, width), bytes, [&](auto loops, void* dst, void*) {
                std::copy(bytes.begin(), bytes.end(), static_cast<std::uint8_t*>(dst));
                loops(width)(dst, n);
            });
        }
    const int widths[KpPrimType::NumTypes] = {1, 2, 4, 4, 8, 4, 4, 2, 4, 1};  // of what is reversed in each type
    for (int type = 0; type < KpPrimType::NumTypes; ++type) {
        Bytes words = someValues<std::uint8_t>(16, 7);
        const Bytes expected = swapped(words, widths[type]);
        KpRawData::swapBytes({words.data(), KpPrimType(type)}, 16UL / KpPrimType(type).size());
        EXPECT_EQ(words, expected) << type;
    }
    const auto warning = logged([] { KpRawData::swapBytes({nullptr, KpPrimType(12)}, 1); });
    EXPECT_EQ(warning, "W Swapping of 0-byte words not supported.");
}
