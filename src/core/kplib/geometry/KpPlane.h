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
/// What is built from usable points or directions has a normal of length 1, on which all
/// operations rely; otherwise the plane is empty. Nothing here reports an error: where there is no
/// result, NaN or zeros come out. A plain value in float arithmetic; a default-made one is not
/// initialised.
class KPLIB_API KpPlane {
public:
    constexpr KpPlane() = default;
    // Each is what set() makes of the same arguments.
    /// @{
    /// As set().
    KpPlane(const KpVec3f& p0, const KpVec3f& p1, const KpVec3f& p2) { set(p0, p1, p2); }
    KpPlane(const KpVec3f& normal, float distance) { set(normal, distance); }
    KpPlane(const KpVec3f& normal, const KpVec3f& point) { set(normal, point); }
    /// @}

    /// A plane of four zeros, always the same object; safe from any thread.
    static const KpPlane& emptyPlane();

    // Each makes the normal of length 1, and all four numbers 0 if its length is 0.

    /// The plane through three points, which run counterclockwise as seen against the normal.
    void set(const KpVec3f& p0, const KpVec3f& p1, const KpVec3f& p2);
    /// `distance` is the one from the origin: it stays as it is, whatever the length of `normal`.
    void set(const KpVec3f& normal, float distance);
    /// The plane through `point`.
    void set(const KpVec3f& normal, const KpVec3f& point);

    /// The normal.
    const KpVec3f& normal() const { return normal_; }
    /// Distance from the origin along the normal.
    float distance() const { return distance_; }
    // These store their argument unchanged: the caller ensures that the normal is of length 1.
    /// Replaces the normal.
    void setNormal(const KpVec3f& normal) { normal_ = normal; }
    /// Replaces the distance.
    void setDistanceFromOrigin(float distance) { distance_ = distance; }

    /// Moves the plane along its normal.
    void offset(float distance) { distance_ += distance; }
    /// Makes the normal of length 1 with the distance as it is, then turns the plane over if that is strictly below 0.
    void normalize();
    /// Moves the plane by `matrix`, which has to be rigid or scale all axes alike: the normal is
    /// multiplied by the matrix itself, not by its inverse transpose.
    void transform(const KpMat4f& matrix);
    /// Moves the plane by the inverse of `matrix`, which may be any.
    void transformInv(const KpMat4f& matrix);

    /// Whether a number is NaN, or the squared length of the normal is strictly outside 0.999 to 1.001.
    bool isEmpty() const;
    /// Whether `point` lies on the plane or on the side that the normal points to.
    bool isInHalfSpace(const KpVec3f& point) const;
    /// The nearest point of the plane.
    KpVec3f getProjectedPoint(const KpVec3f& point) const;

    /// Where the unbounded `line` goes through the plane: `out` = position + direction * t. False, with NaN in `out`
    /// and `t` as it was, if the line is exactly parallel. `t` may be null.
    bool intersect(const KpLine& line, KpVec3f& out, float* t = nullptr) const;
    /// The line in which the planes meet. False, with NaN in all of `line`, if the sine of their angle is below 1e-5.
    bool intersect(const KpPlane& other, KpLine& line) const;

    /// The least and the greatest signed distance of the corners of `box`.
    void getDistance(const KpBox3f& box, float& min, float& max) const;
    /// True and the signed distance of `other` from this plane; false and 0 if they aren't parallel.
    std::pair<bool, float> getDistance(const KpPlane& other) const;

    /// Whether the cosine of the angle is 1 or -1 to within 0.0001, in double precision.
    bool isParallel(const KpPlane& other) const;
    /// Whether the direction of `normal`, of any length but 0, is this normal's to within 0.0001 of the cosine; an
    /// opposite one is taken too, unless `orientationMatters`.
    bool isNearEqualNormal(const KpVec3f& normal, bool orientationMatters) const;
    /// Whether the normals are near equal and the distances from the origin to within `tolerance`, that of an opposite
    /// normal negated. `point` and `extent` take no part: planes are compared everywhere, not in a region.
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
