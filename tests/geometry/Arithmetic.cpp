#include "Random.h"

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpVec3d.h>

#include <cinttypes>
#include <cstdio>

// Prints the bits of what the headers compute inline, to be compared between two ways of compiling this file.

using namespace kplib::test;

namespace {

template <typename Object>
void print(const char* name, const Object& object)
{
    std::printf("%s", name);
    for (const std::uint32_t word : bits(object))
        std::printf(" %08" PRIx32, word);
    std::printf("\n");
}

void printRow(Random& random)
{
    KpVec3f u = random.vector(), v = random.vector();
    print("dot", u.dot(v));
    print("cross", u.cross(v));
    print("arithmetic", u + 2.0F * (u - v) / v.x());
    const KpVec3d wide(u);
    print("dot of doubles", static_cast<float>(wide.dot(KpVec3d(v))));
    print("normalized by", u.normalize());
    print("normalized", u);

    const KpMat3f a = random.matrix3(), b = random.matrix3();
    print("3x3 product", a * b);
    print("3x3 vectors", a.multVecMatrix(v) + a.multMatrixVec(v));
    print("3x3 determinant", a.det3());

    const KpMat4f m = random.matrix4(), n = random.matrix4();
    print("product", m * n);
    print("point", m.multVecMatrix(v));
    print("column", m.multMatrixVec(v));
    print("direction", m.multDirMatrix(v));
    print("row of four", m.multVecMatrix(KpVec4f(v, u.x())));
    print("column of four", m.multMatrixVec(KpVec4f(v, u.x())));
}

}  // namespace

int main()
{
    Random plain(1), special(2, true);
    for (int i = 0; i < 2000; ++i) {
        printRow(plain);
        printRow(special);
    }
    const KpRotation identity = KpRotation::identity();
    print("rotation", identity * identity);
    print("norm", identity.norm());
}
