#include "Elements.h"

#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/KpTypedElement.h>
#include <kplib/rawdata/detail/KpRawDataKernels.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

/// The table of conversions, value by value.
template <typename To, typename From>
To reference(From value)
{
    if constexpr (std::is_floating_point_v<To>) {
        return static_cast<To>(value);
    } else if constexpr (std::is_same_v<To, std::int16_t> && std::is_same_v<From, std::uint16_t>) {
        return static_cast<To>(value);
    } else {
        double low = std::numeric_limits<To>::min(), high = std::numeric_limits<To>::max();
        if (std::is_same_v<To, std::int32_t> && std::is_same_v<From, float>)
            high = 2147483648.0;
        if (std::is_same_v<To, std::int32_t> && std::is_same_v<From, double>)
            low = -2147483646.0;
        const double clamped = value < low ? low : value > high ? high : value;  // NaN passes
        const bool isValid = clamped < 2147483648.0;
        return static_cast<To>(isValid ? static_cast<std::int64_t>(clamped) : INT32_MIN);
    }
}

template <typename To, typename From>
To referenceMap(From value, double offset, double scale)
{
    if constexpr (std::is_same_v<To, double> || (std::is_same_v<From, double> && sizeof(To) == 4)) {
        volatile double sum = static_cast<double>(value) + offset;
        return reference<To, double>(sum * scale);
    } else {
        volatile float sum = static_cast<float>(value) + static_cast<float>(offset);
        return reference<To, float>(sum * static_cast<float>(scale));
    }
}

template <typename Work>
void eachPair(Work work)
{
    eachType([&](auto to) { eachType([&](auto from) { work(to, from); }); });
}

constexpr long sizes[] = {0, 1, 15, 16, 17, 100, 1003};

}  // namespace

TEST(Convert, everyPathEqualsTheTable)
{
    eachPair([]<typename To, typename From>(ElementTag<To>, ElementTag<From>) {
        for (long n : sizes) {
            const std::vector<From> values = someValues<From>(n, 1);
            std::vector<To> expected;
            for (From v : values)
                expected.push_back(reference<To>(v));
            for (const auto& path : convertPaths()) {
                if (!path.usable)
                    continue;
                for (long start : {0, 1, 3}) {
                    Elements<From> src(values, start);
                    Elements<To> dst(n, start);
                    path.run(dst.typed().type, src.typed().type)(dst.data(), src.data(), n);
                    EXPECT_EQ(dst, expected) << path.name << ' ' << dst.typed().type.name() << " from "
                                             << src.typed().type.name() << ' ' << n << '+' << start;
                }
            }
        }
    });
}

TEST(MapLinear, everyPathComputesInThePrecisionOfThePair)
{
    const double maps[][2] = {{0, 1}, {100, 1}, {-1024.3, 0.7}, {1e-10, 3e4}, {1e300, -1}};
    eachPair([&]<typename To, typename From>(ElementTag<To>, ElementTag<From>) {
        const std::vector<From> values = someValues<From>(1003, 2);
        for (const auto& [offset, scale] : maps) {
            std::vector<To> expected;
            for (From v : values)
                expected.push_back(referenceMap<To>(v, offset, scale));
            for (const auto& path : mapPaths()) {
                if (!path.usable)
                    continue;
                Elements<From> src(values, 3);
                Elements<To> dst(1003, 1);
                path.run(dst.typed().type, src.typed().type)(dst.data(), src.data(), 1003, offset, scale);
                EXPECT_EQ(dst, expected) << path.name << ' ' << dst.typed().type.name() << " from "
                                         << src.typed().type.name() << ' ' << offset << ' ' << scale;
            }
        }
    });
}

// As if it were done element by element and forward, wherever the buffers meet.
TEST(Convert, overlappingBuffersAreWorkedForward)
{
    eachPair([]<typename To, typename From>(ElementTag<To>, ElementTag<From>) {
        constexpr long n = 3000, margin = 64;
        if (std::is_same_v<To, From>)
            return;
        for (long distance : {-33L, -8L, 0L, 2L, 40L}) {
            Elements<unsigned char> expected(n * 8 + 2 * margin);
            const std::vector<From> values = someValues<From>(n, 3);
            auto* from = static_cast<unsigned char*>(expected.data()) + margin;
            std::memcpy(from, values.data(), n * sizeof(From));
            Elements<unsigned char> actual = expected;
            auto* actualFrom = static_cast<unsigned char*>(actual.data()) + margin;
            for (long i = 0; i < n; ++i) {
                From v;
                std::memcpy(&v, from + i * sizeof v, sizeof v);
                const To converted = reference<To>(v);
                std::memcpy(from + distance + i * sizeof converted, &converted, sizeof converted);
            }
            KpRawData::memcpy({actualFrom + distance, KpTypedPointer(static_cast<To*>(nullptr)).type},
                              {actualFrom, KpTypedPointer(static_cast<From*>(nullptr)).type}, n);
            EXPECT_EQ(std::memcmp(actual.data(), expected.data(), expected.size()), 0) << distance;
        }
    });
}

TEST(Convert, largeTargetsAreWrittenWhole)
{
    constexpr long n = (8L << 20) + 77;
    for (long start : {0, 2, 3}) {
        Elements<std::uint16_t> src(someValues<std::uint16_t>(n, 4), 0);
        Elements<std::uint8_t> dst(n, start);
        Elements<float> floats(n / 4 + 100, start);
        KpRawData::memcpy(dst.typed(), src.typed(), n);
        KpRawData::mapLinear(floats.typed(), src.typed(), static_cast<unsigned long>(floats.size()), -7, 2);
        long wrong = 0;
        for (long i = 0; i < n; ++i)
            wrong += dst[i] != reference<std::uint8_t>(src[i]);
        for (long i = 0; i < floats.size(); ++i)
            wrong += floats[i] != (src[i] - 7.0f) * 2.0f;
        EXPECT_EQ(wrong, 0) << start;
    }
}

TEST(Convert, typesOutsideTheNumbersAreReportedByTheTarget)
{
    const char complexText[] = "ERROR: KpRawData::memcpy(), complex data are not supported\n";
    const char mapText[] = "ERROR: KpRawData::mapLinear(), mapping from complex to real is not supported\n";
    const struct {
        int to, from;
        const char *copyError, *mapError;
    } cases[] = {
        {5, 2, complexText, mapText},
        {2, 5, complexText, mapText},
        {5, 6, complexText, mapText},
        {6, 2, "Unsupported data type string in KpRawData()\n", "Unsupported data type string in KpRawData()\n"},
        {8, 9, "Unsupported data type uint in KpRawData()\n", "Unsupported data type uint in KpRawData()\n"},
        {77, 6, "Unsupported data type unknown in KpRawData()\n", "Unsupported data type unknown in KpRawData()\n"},
        {2, 6, nullptr, nullptr},
        {2, -1, nullptr, nullptr},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::to_string(c.to) + " from " + std::to_string(c.from));
        double src = 1, dst = 7;
        const auto errorOf = [&](auto work) {
            const LogCapture log;
            work();
            EXPECT_EQ(dst, 7);
            return log.lines().empty() ? std::string() : log.lines()[0];
        };
        const KpTypedPointer to(&dst, KpPrimType(c.to)), from(&src, KpPrimType(c.from));
        const auto ends = [](const std::string& line, const char* text) {
            return text ? line.ends_with(text) && line.starts_with("E") : line.empty();
        };
        EXPECT_TRUE(ends(errorOf([&] { KpRawData::memcpy(to, from, 1); }), c.copyError));
        EXPECT_TRUE(ends(errorOf([&] { KpRawData::mapLinear(to, from, 1, 0, 1); }), c.mapError));
    }
}

TEST(Convert, equalTypesOfAnyKindAreCopiedAsBytes)
{
    for (int type = 0; type < KpPrimType::NumTypes; ++type) {
        const auto values = someValues<std::uint8_t>(80, 5);
        Elements<std::uint8_t> src(values, 0), dst(80);
        KpRawData::memcpy({dst.data(), KpPrimType(type)}, {src.data(), KpPrimType(type)}, 80 / KpPrimType(type).size());
        EXPECT_EQ(dst, values) << type;
        KpRawData::memcpy({dst.data(), KpPrimType(type)}, {nullptr, KpPrimType(type)}, -1);
    }
    float complex[] = {1, 2, 3, 4};
    KpRawData::mapLinear({complex, KpPrimType::Complex}, {complex, KpPrimType::Complex}, 2, 1, 10);
    EXPECT_EQ(std::vector<float>(complex, complex + 4), (std::vector<float>{20, 30, 40, 50}));
}

TEST(KpTypedElement, computesInItsOwnType)
{
    eachType([]<typename T>(ElementTag<T>) {
        T a[] = {T(200), T(-3)}, b[] = {T(100), T(4)};
        KpTypedElement element(a, 2);
        element += KpTypedElement(b, 2);
        EXPECT_EQ(a[0], T(300));  // a byte wraps to 44
        EXPECT_EQ(a[1], T(1));
        element -= KpTypedElement(b, 2);
        EXPECT_EQ(a[0], T(200));
        EXPECT_EQ(a[1], T(-3));
        EXPECT_EQ(element.length(), std::sqrt(double(a[0]) * a[0] + double(a[1]) * a[1]));
        EXPECT_EQ(KpTypedElement(a, 0).length(), 0.0);
    });
    std::int32_t largest[] = {INT32_MAX};
    KpTypedElement ints(largest, 1);
    ints += ints;
    EXPECT_EQ(largest[0], -2);
    KpTypedElement complex({largest, KpPrimType::Complex}, 1);
    complex += complex;
    EXPECT_EQ(largest[0], -2);
    EXPECT_EQ(complex.length(), 0.0);
}
