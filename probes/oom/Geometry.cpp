#include "Operation.h"

#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpCutBoxPlane.h>
#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/shapes/Angle2D.h>
#include <kplib/geometry/shapes/Ellipse2D.h>
#include <kplib/geometry/shapes/Polygon2D.h>

#include <string>
#include <vector>

namespace kplib::probe {

namespace {

const char* const frameId = "1.2.826.0.1.3680043.2.1125.1";

Outcome systems()
{
    const KpHandle<KpFrameOfReference> frame(new KpFrameOfReference(frameId));
    const KpHandle<KpCoordinateSystem> outer(new KpCoordinateSystem);
    outer->setParent(frame.get());
    outer->setOrigin({1, 2, 3});
    const KpHandle<KpCoordinateSystem> inner = outer->createChildSystem();
    const KpHandle<KpCoordinateSystem> merged = inner->mergedWithParent();
    const KpHandle<KpCoordinateSystem> sibling = merged->asChildOf(*inner);
    const KpMat4f matrix = inner->transformationTo(*sibling);
    return Digest().add(&matrix, sizeof matrix) << inner->path().size() << sibling->dump();
}

Outcome cuts()
{
    const KpBox3f box(0, 1, 0, 2, 0, 3);
    const KpCutBoxPlane cut(box, KpVec3f(1, 1, 1));
    const std::vector<KpVec3f> corners = cut.cutPlane(1.5F);
    return Digest().add(corners.data(), corners.size() * sizeof(KpVec3f));
}

Outcome shapes()
{
    Polygon2D polygon({{0, 0}, {4, 0}, {4, 3}});
    polygon.append({0, 3});
    const Polygon2D copy(polygon);
    const Angle2D angle({{0, 1}, {0, 0}, {1, 0}});
    const std::vector<KpVec2f> outline = Ellipse2D({1, 2}, 3, 4).tesselate(24);
    return Digest() << copy.contains({1, 1}) << copy.vertices().size() << angle.angle().second << outline.size();
}

}  // namespace

Operations geometryOperations()
{
    static constexpr Operation list[] = {
        {"coordinate systems", systems}, {"cuts of a box", cuts}, {"flat shapes", shapes}};
    return list;
}

}  // namespace kplib::probe
