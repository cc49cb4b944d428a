#pragma once

#include <kplib/cpu/KernelPath.h>
#include <kplib/foundation/KpString.h>
#include <kplib/system/KpMD5.h>
#include <kplib/system/KpMD5Coder.h>

#include <bit>
#include <cmath>
#include <concepts>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <random>
#include <ranges>
#include <span>
#include <type_traits>
#include <vector>

// Results over fixed seeds as lines "name digest", the same on all processors. Only raw numbers of std::mt19937 are
// used: what the standard's distributions make of them differs between libraries.

namespace kplib::test {

using Random = std::mt19937;

template <std::floating_point T>
T withoutNaNs(T value)  // which NaN comes out is left open by processors
{
    return std::isnan(value) ? std::numeric_limits<T>::quiet_NaN() : value;
}

/// MD5 of results: numbers, ranges of them, and objects made of 32-bit numbers.
class Digest {
public:
    template <typename... Results>
    void take(const Results&... results)
    {
        (takeOne(results), ...);
    }

    KpString text()
    {
        KpString text;
        coder_.md5().toString(text);
        return text;
    }

private:
    template <typename T>
    void takeOne(const T& result)
    {
        if constexpr (std::floating_point<T>) {
            const T value = withoutNaNs(result);
            coder_.append(&value, sizeof value);
        } else if constexpr (std::is_arithmetic_v<T> || std::is_enum_v<T>) {
            const auto value = static_cast<std::int64_t>(result);
            coder_.append(&value, sizeof value);
        } else if constexpr (std::ranges::range<T>) {
            for (const auto& element : result)
                takeOne(element);
        } else {
            static_assert(std::is_trivially_copyable_v<T> && sizeof(T) % 4 == 0);
            takeOne(std::bit_cast<std::array<float, sizeof(T) / 4>>(result));
        }
    }

    KpLib::MD5Coder coder_;
};

/// Prints the line of a family of results; `work(digest, random)` makes them.
template <typename Work>
void family(const char* name, Work work)
{
    Digest digest;
    Random random(1);
    work(digest, random);
    std::printf("%s %s\n", name, digest.text().c_str());
}

/// Prints the line of a kernel's table; `work(run, digest, random)` makes the results of one row. Ends the program if
/// rows differ.
template <typename Function, typename Work>
void table(const char* name, std::span<const detail::KernelPath<Function>> paths, Work work)
{
    const auto digestOf = [&](const detail::KernelPath<Function>& path) {
        Digest digest;
        Random random(1);
        work(path.run, digest, random);
        return digest.text();
    };
    const KpString plain = digestOf(paths[0]);
    for (const auto& path : paths) {
        if (path.usable && digestOf(path) != plain) {
            std::printf("%s: row %s differs from %s\n", name, path.name, paths[0].name);
            std::exit(1);
        }
    }
    std::printf("%s %s\n", name, plain.c_str());
}

/// Numbers: half of them any bits at all, half about the bounds of the small types.
template <typename T>
std::vector<T> noise(Random& random, long n)
{
    std::vector<T> numbers(static_cast<std::size_t>(n));
    for (T& number : numbers) {
        const std::uint64_t low = random(), bits = low | std::uint64_t{random()} << 32;
        if constexpr (std::integral<T>)
            number = static_cast<T>(bits);
        else if (bits >> 63)
            number = std::ldexp(static_cast<T>(static_cast<std::int32_t>(low)), -static_cast<int>(random() % 24));
        else if constexpr (sizeof(T) == 4)
            number = std::bit_cast<float>(static_cast<std::uint32_t>(bits));
        else
            number = std::bit_cast<double>(bits << 1);
    }
    return numbers;
}

void digestsOfKernels();
void digestsOfGeometry();
void digestsOfNumerics();

}  // namespace kplib::test
