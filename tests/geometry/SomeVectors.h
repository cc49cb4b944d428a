#pragma once

#include <kplib/geometry/KpVec3d.h>
#include <kplib/geometry/KpVec3f.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <random>

namespace kplib::test {

constexpr float NaN = std::numeric_limits<float>::quiet_NaN();
constexpr KpVec3f origin(0, 0, 0), x(1, 0, 0), y(0, 1, 0), z(0, 0, 1), untouched(7, 8, 9);

inline bool isNaN(const KpVec3f& v)
{
    return std::all_of(v.begin(), v.end(), [](float c) { return std::isnan(c); });
}

// Components within `range` of 0.
inline KpVec3f someVector(std::mt19937& random, float range)
{
    std::uniform_real_distribution<float> components(-range, range);
    return {components(random), components(random), components(random)};
}

inline float someNumber(std::mt19937& random, float low, float high)
{
    return std::uniform_real_distribution<float>(low, high)(random);
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
