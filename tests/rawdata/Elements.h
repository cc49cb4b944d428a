#pragma once

#include <kplib/foundation/KpPrimTypeVisit.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/rawdata/detail/RawDataKernels.h>

#include <support/LogCapture.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <limits>
#include <random>
#include <type_traits>

namespace kplib::test {

using Bytes = std::vector<std::uint8_t>;

template <typename T>
const KpPrimType typeOf = KpTypedPointer(static_cast<T*>(nullptr)).type;

/// Calls `work` with the tag of each element type.
template <typename Work>
void eachType(Work work)
{
    for (int type : {0, 1, 2, 3, 4, 7}) {
        const testing::ScopedTrace trace(__FILE__, __LINE__, KpPrimType(type).name());
        kpVisitNumberType(KpPrimType(type), work);
    }
}

/// Random values of all magnitudes, with those mixed in at which conversions change their mind.
template <typename T>
std::vector<T> someValues(long n, unsigned seed)
{
    const double edges[] = {0.0,          1e-40,        0.5,     1.9,          254.9,        255.5,
                            32767.5,      32768.0,      65535.9, 2147483520.0, 2147483645.5, 2147483646.5,
                            2147483647.0, 2147483648.0, 3e9,     INFINITY,     NAN};
    std::mt19937 random(seed);
    std::vector<T> values(n);
    for (T& v : values) {
        if constexpr (std::is_integral_v<T>)
            v = static_cast<T>(static_cast<std::int32_t>(random()) >> random() % 32);
        else if (random() % 3 == 0)
            v = static_cast<T>(edges[random() % std::size(edges)] * (random() % 2 ? 1 : -1));
        else
            v = static_cast<T>(std::ldexp(double(random()) - 2147483648.0, -int(random() % 40)));
    }
    return values;
}

/// To the bit, but for NaN: which one a sum of two of them gives is the compiler's choice.
template <typename T>
bool areSame(const std::vector<T>& a, const std::vector<T>& b)
{
    return std::equal(a.begin(), a.end(), b.begin(), b.end(),
                      [](T x, T y) { return !std::memcmp(&x, &y, sizeof x) || (std::isnan(x) && std::isnan(y)); });
}

/// What `work(address)` makes of `values`, `start` bytes off, in memory that ends with them, so that a step over shows.
template <typename T, typename Work>
std::vector<T> worked(std::vector<T> values, long start, Work work)
{
    const std::size_t size = values.size() * sizeof(T);
    Bytes bytes(start + size);
    std::copy_n(reinterpret_cast<const std::uint8_t*>(values.data()), size, bytes.data() + start);
    work(bytes.data() + start);
    std::copy_n(bytes.data() + start, size, reinterpret_cast<std::uint8_t*>(values.data()));
    return values;
}

/// Has `run(loop, dst, src)` make `expected` out of `values` by each path of a kernel table that this processor can
/// run, at addresses of any kind.
template <typename To, typename From, typename Paths, typename Run>
void expectOfEachPath(Paths paths, const std::vector<To>& expected, const std::vector<From>& values, Run run)
{
    for (const auto& path : paths)
        for (long start : {0, 1, 3})
            worked(values, start, [&](void* src) {
                const auto result = worked(std::vector<To>(expected.size()), start, [&](void* dst) {
                    if (path.usable)
                        run(path.run, dst, src);
                });
                EXPECT_TRUE(!path.usable || areSame(result, expected))
                    << path.name << ' ' << values.size() << '+' << start;
            });
}

/// What `work` writes to the log, such as "E text".
template <typename Work>
std::string logged(Work work)
{
    const LogCapture log;
    work();
    std::string text;
    for (const std::string& line : log.lines())
        text += line.substr(0, 2) + line.substr(line.find("] ") + 2);
    return text;
}

}  // namespace kplib::test
