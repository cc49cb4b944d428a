#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

#include <string>
#include <type_traits>
#include <utility>

class KpBox3f;
class KpLine;
class KpMat4f;

/// An unbounded plane in space: the points p with normal · p = distance, a normal and a float and nothing else, so that
/// the object is its own byte image.
///
/// A plane constructed from valid points or directions has a normal of length 1, which all
/// operations require. Otherwise the plane is empty. No operation reports an error: without a
/// result it returns NaN or zeros. A plain value in float arithmetic. A default-constructed plane
/// is not initialised.
class KPLIB_API KpPlane {
public:
    constexpr KpPlane() = default;
    // Each constructor does what set() does with the same arguments.
    /// @{
    /// As set().
    KpPlane(const KpVec3f& p0, const KpVec3f& p1, const KpVec3f& p2) { set(p0, p1, p2); }
    KpPlane(const KpVec3f& normal, float distance) { set(normal, distance); }
    KpPlane(const KpVec3f& normal, const KpVec3f& point) { set(normal, point); }
    /// @}

    /// A plane of four zeros, always the same object; safe from any thread.
    static const KpPlane& emptyPlane();

    // Each set() normalises the normal, and sets all four numbers to 0 if its length is 0.

    /// The plane through three points, which run counterclockwise as seen against the normal.
    void set(const KpVec3f& p0, const KpVec3f& p1, const KpVec3f& p2);
    /// Sets normal and distance from the origin. `distance` is not scaled with the length of
    /// `normal`.
    void set(const KpVec3f& normal, float distance);
    /// The plane through `point`.
    void set(const KpVec3f& normal, const KpVec3f& point);

    /// The normal.
    const KpVec3f& normal() const { return normal_; }
    /// Distance from the origin along the normal.
    float distance() const { return distance_; }
    // The next two store their argument unchanged. Precondition: the normal has length 1.
    /// Replaces the normal.
    void setNormal(const KpVec3f& normal) { normal_ = normal; }
    /// Replaces the distance.
    void setDistanceFromOrigin(float distance) { distance_ = distance; }

    /// Moves the plane along its normal.
    void offset(float distance) { distance_ += distance; }
    /// Normalises the normal and keeps the distance. Then, if the distance is strictly below 0,
    /// reverses the plane.
    void normalize();
    /// Transforms the plane by `matrix`, which must be rigid or scale all axes alike: the normal
    /// is multiplied by the matrix itself, not by its inverse transpose.
    void transform(const KpMat4f& matrix);
    /// Transforms the plane by the inverse of `matrix`, which may be any matrix.
    void transformInv(const KpMat4f& matrix);

    /// Whether a number is NaN, or the squared length of the normal is strictly outside 0.999 to 1.001.
    bool isEmpty() const;
    /// Whether `point` lies on the plane or on the side that the normal points to.
    bool isInHalfSpace(const KpVec3f& point) const;
    /// The nearest point of the plane.
    KpVec3f getProjectedPoint(const KpVec3f& point) const;

    /// Intersects the plane with the unbounded `line`: `out` = position + direction * t. Returns
    /// false, sets `out` to NaN and leaves `t` unchanged if the line is exactly parallel. `t` may
    /// be null.
    bool intersect(const KpLine& line, KpVec3f& out, float* t = nullptr) const;
    /// Sets `line` to the intersection of the planes. Returns false and sets `line` to NaN if the
    /// sine of their angle is below 1e-5.
    bool intersect(const KpPlane& other, KpLine& line) const;

    /// The least and the greatest signed distance of the corners of `box`.
    void getDistance(const KpBox3f& box, float& min, float& max) const;
    /// Returns true and the signed distance of `other` from this plane, or false and 0 if the
    /// planes are not parallel.
    std::pair<bool, float> getDistance(const KpPlane& other) const;

    /// Whether the cosine of the angle is 1 or -1 to within 0.0001, in double precision.
    bool isParallel(const KpPlane& other) const;
    /// Whether `normal`, of any length but 0, has the direction of this plane's normal to within
    /// 0.0001 of the cosine. The opposite direction also matches unless `orientationMatters`.
    bool isNearEqualNormal(const KpVec3f& normal, bool orientationMatters) const;
    /// Whether isNearEqualNormal() holds and the distances from the origin are equal to within
    /// `tolerance`; for an opposite normal the distance is negated. `point` and `extent` are
    /// ignored: planes are compared everywhere, not in a region.
    bool isNearEqualInROI(const KpPlane& other, const KpVec3f& point, float extent, float tolerance,
                          bool orientationMatters) const;

    /// Exact; a plane that holds a NaN equals none.
    friend constexpr bool operator==(const KpPlane& a, const KpPlane& b) = default;

    /// {"normal":{"x":"0.000000","y":"0.000000","z":"1.000000"},"distance":"2.000000"}
    std::string dump() const;

private:
    float setUnitNormal(const KpVec3f& normal);
    void flip();

    KpVec3f normal_;
    float distance_;
};

static_assert(sizeof(KpPlane) == 16 && std::is_trivially_copyable_v<KpPlane>);
