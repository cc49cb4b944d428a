#include <kplib/geometry/numerics/KpFitPlane.h>

#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/numerics/detail/PairwiseSum.h>

namespace {

KpVec3f sumOf(const KpDArray<KpVec3f>& points)
{
    return kplib::detail::pairwiseSum<KpVec3f>(points.size(), [&](KpVec3f& sum, long i, long end) {
        for (; i < end; ++i)
            sum += points[i];
    });
}

struct ScatterSums {
    float xx, xy, xz, yy, yz, zz;

    ScatterSums& operator+=(const ScatterSums& other)
    {
        xx += other.xx;
        xy += other.xy;
        xz += other.xz;
        yy += other.yy;
        yz += other.yz;
        zz += other.zz;
        return *this;
    }
};

// The sum of transpose(d) * d over the differences from `centroid`.
KpMat3f scatterMatrix(const KpDArray<KpVec3f>& points, const KpVec3f& centroid)
{
    const auto s = kplib::detail::pairwiseSum<ScatterSums>(points.size(), [&](ScatterSums& sums, long i, long end) {
        for (; i < end; ++i) {
            const KpVec3f d = points[i] - centroid;
            sums +=
                ScatterSums{d.x() * d.x(), d.x() * d.y(), d.x() * d.z(), d.y() * d.y(), d.y() * d.z(), d.z() * d.z()};
        }
    });
    return {s.xx, s.xy, s.xz, s.xy, s.yy, s.yz, s.xz, s.yz, s.zz};
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
    centroid_ = sumOf(points_) / static_cast<float>(points_.size());

    float evalues[3];
    KpVec3f evectors[3] = {normal_, normal_, normal_};  // the result if the eigenvectors are not found
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
