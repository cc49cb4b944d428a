#pragma once

#include <kplib/geometry/KpVec3d.h>
#include <kplib/geometry/KpVec3f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <limits>
#include <random>

namespace kplib::test {

constexpr float NaN = std::numeric_limits<float>::quiet_NaN(), infinity = std::numeric_limits<float>::infinity();
constexpr KpVec3f origin(0, 0, 0), x(1, 0, 0), y(0, 1, 0), z(0, 0, 1), untouched(7, 8, 9);

inline bool isNaN(const KpVec3f& v)
{
    return std::all_of(v.begin(), v.end(), [](float c) { return std::isnan(c); });
}

inline float someNumber(std::mt19937& random, float low, float high)
{
    return std::uniform_real_distribution<float>(low, high)(random);
}

// Components within `range` of 0.
inline KpVec3f someVector(std::mt19937& random, float range)
{
    return {someNumber(random, -range, range), someNumber(random, -range, range), someNumber(random, -range, range)};
}

// An object of floats from -2 to 2; a `special` one mixes in zeros, infinities, NaN, tiny and huge numbers.
template <typename Object>
Object some(std::mt19937& random, bool special = false)
{
    const float specials[] = {0, -0.0F, infinity, -infinity, NaN, 1e30F, -1e-30F, 1e-45F};
    std::array<float, sizeof(Object) / 4> numbers;
    for (float& number : numbers) {
        const auto choice = special ? random() % 32 : 8;
        number = choice < 8 ? specials[choice] : static_cast<float>(random()) * 0x1p-30F - 2;
    }
    return std::bit_cast<Object>(numbers);
}

// The floats of an object as words, all NaN alike: which one of two comes out is left open by the processor.
template <typename Object>
auto bits(const Object& object)
{
    auto numbers = std::bit_cast<std::array<float, sizeof(Object) / 4>>(object);
    std::replace_if(
        numbers.begin(), numbers.end(), [](float number) { return std::isnan(number); }, NaN);
    return std::bit_cast<std::array<std::uint32_t, sizeof(Object) / 4>>(numbers);
}

inline double distance(const KpVec3f& a, const KpVec3d& b)
{
    return (KpVec3d(a) - b).length();
}

inline void expectNear(const KpVec3f& a, const KpVec3f& b, float tolerance = 1e-3F)
{
    EXPECT_LT((a - b).length(), tolerance) << a << " and " << b;
}

}  // namespace kplib::test
