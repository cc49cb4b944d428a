#include <kplib/geometry/KpCutBoxPlane.h>

#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/detail/CutBox.h>

#include <span>

using namespace kplib::detail;

namespace {

std::span<const float, 6> bounds(const KpBox3f& box)
{
    return std::span<const float, 6>(box.data(), 6);
}

}  // namespace

KpCutBoxPlane::KpCutBoxPlane() : KpCutBoxPlane(KpBox3f(0, 1, 0, 1, 0, 1), KpVec3f(1, 0, 0)) {}

void KpCutBoxPlane::init(const KpBox3f& box, const KpVec3f& normal)
{
    box_ = box;
    fillCorners(corners_, bounds(box));
    projectCorners(cornerValues_, corners_, normal);
}

void KpCutBoxPlane::init(const KpBox3f& box1, const KpBox3f& box2, const KpVec3f& normal)
{
    fillCorners(secondCorners_, bounds(box2));
    init(box1, normal);
}

std::vector<KpVec3f> KpCutBoxPlane::cutPlane(float distance) const
{
    KpVec3f vertices[6];
    // Weighs both corners, other than the form with arrays: the two may differ in the last bit.
    const int count = visitCut(cornerValues_, distance, [&](int i, int a, int b, float t) {
        vertices[i] = corners_[b] * (1 - t) + corners_[a] * t;
    });
    return {vertices, vertices + count};
}

int KpCutBoxPlane::cutPlane(float distance, KpVec3f* vertices, KpVec3f* secondVertices) const
{
    return cutCorners(cornerValues_, distance, corners_, vertices, secondCorners_, secondVertices);
}

std::vector<KpVec3f> KpCutBoxPlane::cutPlane(const KpBox3f& box, const KpPlane& plane)
{
    return KpCutBoxPlane(box, plane.normal()).cutPlane(plane.distance());
}

std::vector<KpVec3f> KpCutBoxPlane::cutPlane(const KpVec3f& min, const KpVec3f& max, const KpPlane& plane)
{
    return cutPlane(KpBox3f(min, max), plane);
}

int KpCutBoxPlane::cutPlane(const KpBox3f& box1, const KpBox3f& box2, const KpPlane& plane, KpVec3f* vertices,
                            KpVec3f* secondVertices)
{
    return KpCutBoxPlane(box1, box2, plane.normal()).cutPlane(plane.distance(), vertices, secondVertices);
}
