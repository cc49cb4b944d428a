#include <kplib/geometry/KpCutBoxPlaneDouble.h>

#include <kplib/geometry/detail/CutBox.h>

#include <algorithm>

using namespace kplib::detail;

KpCutBoxPlaneDouble::KpCutBoxPlaneDouble() : KpCutBoxPlaneDouble(KpVec3d(0, 0, 0), KpVec3d(1, 1, 1), KpVec3d(1, 0, 0))
{
}

KpCutBoxPlaneDouble::KpCutBoxPlaneDouble(const KpVec3d& min, const KpVec3d& max, const KpVec3d& normal)
{
    const double box[] = {min.x(), max.x(), min.y(), max.y(), min.z(), max.z()};
    init(box, normal);
}

void KpCutBoxPlaneDouble::init(Box box, const KpVec3d& normal)
{
    normal_ = normal;
    std::copy(box.begin(), box.end(), box_);
    fillCorners(corners_, box);
    projectCorners(cornerValues_, corners_, normal);
}

void KpCutBoxPlaneDouble::init(Box box1, Box box2, const KpVec3d& normal)
{
    fillCorners(secondCorners_, box2);
    init(box1, normal);
}

int KpCutBoxPlaneDouble::cutPlane(double distance, KpVec3d* vertices, KpVec3d* secondVertices) const
{
    return cutCorners(cornerValues_, distance, corners_, vertices, secondCorners_, secondVertices);
}
