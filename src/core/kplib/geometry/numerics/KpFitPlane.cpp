#include <kplib/geometry/numerics/KpFitPlane.h>

#include <kplib/geometry/KpMat3f.h>

namespace {

/// The sum of transpose(d) * d over the differences from `centroid`.
KpMat3f scatterMatrix(const KpDArray<KpVec3f>& points, const KpVec3f& centroid)
{
    float xx = 0, xy = 0, xz = 0, yy = 0, yz = 0, zz = 0;
    for (const KpVec3f& point : points) {
        const KpVec3f d = point - centroid;
        xx += d.x() * d.x();
        xy += d.x() * d.y();
        xz += d.x() * d.z();
        yy += d.y() * d.y();
        yz += d.y() * d.z();
        zz += d.z() * d.z();
    }
    return {xx, xy, xz, xy, yy, yz, xz, yz, zz};
}

KpMat4f columnTranslation(const KpVec3f& translation)
{
    KpMat4f matrix;
    matrix.setTranslate(translation);
    return matrix.transpose();
}

}  // namespace

KpFitPlane::~KpFitPlane() = default;

void KpFitPlane::fit()
{
    if (points_.size() >= 3)
        createPlane();
}

float KpFitPlane::orthogonalPlaneFit()
{
    if (points_.size() == 0)
        return 0;
    KpVec3f sum(0, 0, 0);
    for (const KpVec3f& point : points_)
        sum += point;
    centroid_ = sum / static_cast<float>(points_.size());

    float evalues[3];
    KpVec3f evectors[3] = {normal_, normal_, normal_};  // stays when the eigenvectors can't be found
    int rotations = 0;
    scatterMatrix(points_, centroid_).jacobi(evalues, evectors, rotations);
    int smallest = evalues[0] > evalues[1] ? 1 : 0;
    if (evalues[smallest] > evalues[2])
        smallest = 2;
    normal_ = evectors[smallest];
    return evalues[smallest];
}

const KpMat4f& KpFitPlane::createPlane()
{
    orthogonalPlaneFit();
    normal_.normalize();
    KpVec3f u = normal_.cross(KpVec3f(1, 0, 0));
    u.normalize();
    KpVec3f v = normal_.cross(u);
    v.normalize();
    KpMat3f projector;
    for (int i = 0; i < 3; ++i) {
        for (int j = 0; j < 3; ++j)
            projector[i][j] = u[i] * u[j] + v[i] * v[j];
    }
    projection_ = columnTranslation(centroid_) * KpMat4f(projector) * columnTranslation(-centroid_);
    return projection_;
}
