#include <kplib/geometry/KpMat4f.h>

void KpMat4f::multVecMatrix(std::span<const KpVec3f> points, KpVec3f* results) const
{
    for (const KpVec3f& point : points)
        *results++ = multVecMatrix(point);
}
