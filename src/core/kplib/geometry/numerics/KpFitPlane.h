#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec3f.h>

/// The plane that is nearest to a cloud of points: the sum of the squares of their distances from it is least.
///
/// Fill points() and call fit(). One thread at a time.
///
/// Accuracy: sums are pairwise, in single precision, so that the number of points hardly matters; their distance from
/// the origin does. The normal of 100,000 points of a square with sides of 100, which lies 100,000 from the origin, is
/// within 0.1 degree. Move smaller or more distant clouds to the origin first.
class KPLIB_API KpFitPlane {
public:
    KpFitPlane() = default;
    /// @{
    /// Copies points and results.
    KpFitPlane(const KpFitPlane&) = default;
    KpFitPlane& operator=(const KpFitPlane&) = default;
    /// @}

    virtual ~KpFitPlane();

    /// createPlane(); with fewer than 3 points nothing. O(n).
    virtual void fit();

    /// Sets centroid() and a normal() of length 1, and gives the smallest eigenvalue of the scatter matrix, the sum of
    /// the squared distances from the plane. With no points 0, and nothing is set.
    float orthogonalPlaneFit();
    /// orthogonalPlaneFit(), and projection() from it, which it returns.
    const KpMat4f& createPlane();

    /// @{
    /// The points, empty at first.
    KpDArray<KpVec3f>& points() { return points_; }
    const KpDArray<KpVec3f>& points() const { return points_; }
    /// @}

    /// The mean of the points.
    const KpVec3f& centroid() const { return centroid_; }
    /// The normal, of length 1 after a fit.
    const KpVec3f& normal() const { return normal_; }
    /// Takes a point to its foot on the plane by KpMat4f::multMatrixVec(). Intentional: unlike most matrices, this is
    /// one for column vectors. With a normal along x it collapses toward a line.
    const KpMat4f& projection() const { return projection_; }

private:
    KpDArray<KpVec3f> points_;
    KpVec3f centroid_{0, 0, 0};
    KpVec3f normal_{0, 0, 0};
    KpMat4f projection_ = KpMat4f::identity();
};
