#include "Elements.h"

#include <kplib/rawdata/KpTypedElement.h>

#include <functional>

using namespace kplib::test;
using namespace kplib::detail;

namespace {

/// The table of conversions, value by value.
template <typename To, typename From>
To reference(From value)
{
    constexpr bool isBitCopy = std::is_same_v<To, std::int16_t> && std::is_same_v<From, std::uint16_t>;
    if constexpr (std::is_floating_point_v<To> || isBitCopy) {
        return static_cast<To>(value);
    } else {
        double low = std::numeric_limits<To>::min(), high = std::numeric_limits<To>::max();
        if (std::is_same_v<To, std::int32_t> && std::is_same_v<From, float>)
            high = 2147483648.0;
        if (std::is_same_v<To, std::int32_t> && std::is_same_v<From, double>)
            low = -2147483646.0;
        const double clamped = value < low ? low : value > high ? high : value;  // NaN passes
        return static_cast<To>(clamped < 2147483648.0 ? static_cast<std::int64_t>(clamped) : INT32_MIN);
    }
}

template <typename To, typename From>
To referenceMap(From value, double offset, double scale)
{
    constexpr bool isDouble = std::is_same_v<To, double> || (std::is_same_v<From, double> && sizeof(To) == 4);
    using Real = std::conditional_t<isDouble, double, float>;
    volatile Real sum = static_cast<Real>(value) + static_cast<Real>(offset);
    return reference<To, Real>(sum * static_cast<Real>(scale));
}

template <typename To, typename From, typename Convert>
std::vector<To> each(const std::vector<From>& values, Convert convert)
{
    std::vector<To> result;
    for (From v : values)
        result.push_back(convert(v));
    return result;
}

template <typename Work>
void eachPair(Work work)
{
    eachType([&](auto to) { eachType([&](auto from) { work(to, from); }); });
}

}  // namespace

TEST(Convert, everyPathEqualsTheTableAndComputesInThePrecisionOfThePair)
{
    eachPair([]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>) {
        for (long n : {0, 1, 15, 16, 17, 100, 1003}) {
            const auto values = someValues<From>(n, 1);
            const auto check = [&](auto paths, auto convert, auto... map) {
                expectOfEachPath(paths, each<To>(values, convert), values, [=](auto loops, void* dst, void* src) {
                    loops(typeOf<To>, typeOf<From>)(dst, src, n, map...);
                });
            };
            check(convertPaths(), reference<To, From>);
            for (auto [o, s] : {std::pair{0.0, 1.0}, {100, 1}, {-1024.3, 0.7}, {1e-10, 3e4}, {1e300, -1}})
                check(mapPaths(), std::bind(referenceMap<To, From>, std::placeholders::_1, o, s), o, s);
        }
    });
}

// As if it were done element by element and forward, wherever the buffers meet.
TEST(Convert, overlappingBuffersAreWorkedForward)
{
    eachPair([]<typename To, typename From>(KpElementTag<To>, KpElementTag<From>) {
        constexpr long n = 3000, margin = 64;
        for (long distance : {-33L, -8L, 0L, 2L, 40L}) {
            if (std::is_same_v<To, From>)
                continue;
            Bytes expected(n * 8 + 2 * margin);
            std::memcpy(&expected[margin], someValues<From>(n, 3).data(), n * sizeof(From));
            Bytes actual = expected;
            for (long i = 0; i < n; ++i) {
                From v;
                std::memcpy(&v, &expected[margin + i * sizeof v], sizeof v);
                const To converted = reference<To>(v);
                std::memcpy(&expected[margin + distance + i * sizeof converted], &converted, sizeof converted);
            }
            KpRawData::memcpy({&actual[margin + distance], typeOf<To>}, {&actual[margin], typeOf<From>}, n);
            EXPECT_TRUE(actual == expected) << distance;
        }
    });
}

TEST(Convert, largeTargetsAreWrittenWhole)
{
    auto values = someValues<std::uint16_t>((8L << 20) + 77, 4);
    const auto bytes = each<std::uint8_t>(values, reference<std::uint8_t, std::uint16_t>);
    const auto floats = each<float>(values, [](std::uint16_t v) { return (v - 7.0f) * 2.0f; });
    const long n = long(values.size());
    const auto convert = [&](std::uint8_t* to) { KpRawData::memcpy(to, values.data(), n); };
    const auto map = [&](void* to) { KpRawData::mapLinear({to, KpPrimType::Float}, values.data(), n, -7, 2); };
    for (long start : {0, 4, 3}) {
        EXPECT_TRUE(bytes == worked(Bytes(n), start, convert)) << start;
        EXPECT_TRUE(floats == worked(std::vector<float>(n), start, map)) << start;
    }
}

TEST(Convert, typesOutsideTheNumbersAreReportedByTheTarget)
{
    const std::string complexCopy = "E ERROR: KpRawData::memcpy(), complex data are not supported\n";
    const std::string complexMap = "E ERROR: KpRawData::mapLinear(), mapping from complex to real is not supported\n";
    const auto unsupported = [](std::string name) { return "E Unsupported data type " + name + " in KpRawData()\n"; };
    // clang-format off
    const struct { int to, from; std::string copyError, mapError; } cases[] = {
        {5, 6, complexCopy, complexMap}, {2, 5, complexCopy, complexMap}, {8, 9, unsupported("uint"), unsupported("uint")},
        {77, 6, unsupported("unknown"), unsupported("unknown")}, {2, 6, "", ""}, {2, -1, "", ""}};
    // clang-format on
    for (const auto& c : cases) {
        double src = 1, dst = 7;
        const KpTypedPointer to(&dst, KpPrimType(c.to)), from(&src, KpPrimType(c.from));
        EXPECT_EQ(logged([&] { KpRawData::memcpy(to, from, 1); }), c.copyError);
        EXPECT_EQ(logged([&] { KpRawData::mapLinear(to, from, 1, 0, 1); }), c.mapError);
        EXPECT_EQ(dst, 7);
    }
}

TEST(Convert, equalTypesOfAnyKindAreCopiedAsBytes)
{
    for (int number = 0; number < KpPrimType::NumTypes; ++number) {
        const KpPrimType type(number);
        Bytes src = someValues<std::uint8_t>(80, 5), dst(80);
        KpRawData::memcpy({dst.data(), type}, {src.data(), type}, 80 / type.size());
        KpRawData::memcpy({dst.data(), type}, {nullptr, type}, -1);
        EXPECT_EQ(dst, src) << number;
    }
    std::vector<float> complex = {1, 2, 3, 4};
    KpRawData::mapLinear({complex.data(), KpPrimType::Complex}, {complex.data(), KpPrimType::Complex}, 2, 1, 10);
    EXPECT_EQ(complex, (std::vector<float>{20, 30, 40, 50}));
}

TEST(KpTypedElement, computesInItsOwnType)
{
    eachType([]<typename T>(KpElementTag<T>) {
        const T most = std::numeric_limits<T>::max(), least = std::numeric_limits<T>::min();
        T a[] = {most, T(-3)}, b[] = {T(100), T(4)};
        KpTypedElement element(a, 2), complex({a, KpPrimType::Complex}, 1);
        EXPECT_TRUE(&(element += KpTypedElement(b, 2)) == &element);
        EXPECT_EQ(a[0], (std::is_integral_v<T> ? T(least + 99) : most));
        EXPECT_EQ(a[1], T(1));
        element -= KpTypedElement(b, 2);
        complex += complex;
        EXPECT_EQ(a[1], T(-3));
        EXPECT_EQ(KpTypedElement(b, 2).length(), std::sqrt(10016.0));
        EXPECT_EQ(complex.length() + KpTypedElement(a, 0).length() + KpTypedElement(a, -1).length(), 0.0);
    });
}
