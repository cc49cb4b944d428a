#include "SomeVectors.h"

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>

#include <cinttypes>
#include <cstdio>

// Prints the bits of what the headers compute inline, to be compared between two ways of compiling this file.

using namespace kplib::test;

namespace {

template <typename... Objects>
void print(const Objects&... objects)
{
    const auto printOne = [](const auto& object) {
        for (const std::uint32_t word : bits(object))
            std::printf("%08" PRIx32 " ", word);
    };
    (printOne(objects), ...);
    std::printf("\n");
}

}  // namespace

int main()
{
    std::mt19937 random(1);
    for (int i = 0; i < 4000; ++i) {
        const bool special = i % 2;
        const auto u = some<KpVec3f>(random, special), v = some<KpVec3f>(random, special);
        const auto a = some<KpMat3f>(random, special), b = some<KpMat3f>(random, special);
        const auto m = some<KpMat4f>(random, special), n = some<KpMat4f>(random, special);
        const auto p = some<KpRotation>(random, special), q = some<KpRotation>(random, special);
        const KpVec4f wide(v, u.x());
        KpVec3f unit = u;
        print(unit.normalize(), unit, u.dot(v), u.cross(v), u + 2.0F * (u - v) / v.x());
        print(static_cast<float>(KpVec3d(u).dot(KpVec3d(v))), p * q, p.norm());
        print(a * b, a.multVecMatrix(v), a.multMatrixVec(v), a.det3());
        print(m * n, m.multVecMatrix(v), m.multMatrixVec(v), m.multDirMatrix(v));
        print(m.multVecMatrix(wide), m.multMatrixVec(wide));
    }
}
