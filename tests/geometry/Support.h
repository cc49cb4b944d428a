#pragma once

#include <kplib/geometry/KpVec3f.h>

#include <gtest/gtest.h>

#include <random>

struct Random {
    std::mt19937 engine{64};
    float number(float low, float high) { return std::uniform_real_distribution<float>(low, high)(engine); }
    KpVec3f vector(float size = 2) { return {number(-size, size), number(-size, size), number(-size, size)}; }
};

inline void expectNear(const KpVec3f& a, const KpVec3f& b, float tolerance = 1e-3F)
{
    EXPECT_LT((a - b).length(), tolerance) << a << " and " << b;
}
