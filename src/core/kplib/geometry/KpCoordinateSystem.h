#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpAbstractCoordinateSystem.h>
#include <kplib/geometry/KpMat3f.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpVec3f.h>

#include <array>
#include <string>
#include <vector>

class KpPlane;

/// A coordinate system in the space of its parent: an origin and three axes of any length and at
/// any angles. The point (u, v, w) is at origin + u x + v y + w z in the parent's space.
///
///     KpHandle<KpFrameOfReference> patient(new KpFrameOfReference("1.2.3"));
///     KpHandle<KpCoordinateSystem> slices = patient->createChildSystem();
///     slices->setOrigin(KpVec3f(-120, -100, 40));
///     slices->setAxis(KpCoordinateSystem::AxisZ, KpVec3f(0, 0, 2));
///     const KpMat4f toPatient = slices->asTransformationToFrameOfReference();
///     const KpVec3f place = toPatient.multVecMatrix(KpVec3f(0, 0, 3));
///     std::printf("slice 3 is at z = %g\n", double(place.z()));  // prints: slice 3 is at z = 46
///
/// A system without a parent floats: it has no frame of reference and is compatible with no
/// system, not even with itself. If a system cannot be computed from the input, its numbers become
/// NaN and isValid() is false. No other errors occur. For ownership see
/// KpAbstractCoordinateSystem.
class KPLIB_API KpCoordinateSystem : public KpAbstractCoordinateSystem {
public:
    /// Names of the axes, for operations with an `axis` from 0 to 2.
    enum AxisIndex {
        AxisX,  ///< 0
        AxisY,  ///< 1
        AxisZ,  ///< 2
    };

    /// Origin zero, unit axes, no parent.
    KpCoordinateSystem() = default;
    /// No parent; all NaN if the result is not isValid().
    KpCoordinateSystem(const KpVec3f& origin, const std::array<KpVec3f, 3>& axes);
    /// No parent, otherwise as setByMatrix().
    explicit KpCoordinateSystem(const KpMat4f& matrix) { setByMatrix(matrix); }

    /// The rows are the axes and the origin; the last column is ignored and nothing is tested.
    void setByMatrix(const KpMat4f& matrix);
    /// Origin zero, unit axes; the parent stays.
    void makeIdentity();
    /// All twelve numbers NaN; the parent stays.
    void makeNaN();

    /// Sets the parent; null makes the system float. Precondition: no system is its own ancestor.
    void setParent(const KpAbstractCoordinateSystem* parent) { parent_ = parent; }
    /// Replaces the origin.
    void setOrigin(const KpVec3f& origin) { origin_ = origin; }
    /// Replaces one axis.
    void setAxis(int axis, const KpVec3f& value) { axes_[static_cast<std::size_t>(axis)] = value; }
    /// Replaces the axes.
    void setAxes(const std::array<KpVec3f, 3>& axes) { axes_ = axes; }
    /// Sets right-handed orthogonal unit axes with z along `zAxis` and x as near to `xHint` as
    /// possible. If `xHint` is zero, x is arbitrary. If `xHint` is parallel to `zAxis`, x and y
    /// become zero.
    void setAxes(const KpVec3f& zAxis, const KpVec3f& xHint);
    /// The unit axes turned by `rotation`.
    void setAxesByRotation(const KpRotation& rotation);
    /// Keeps `axis` and makes the two others orthogonal to it and to each other; their lengths
    /// change. With `keepDirection` neither turns by more than a right angle, which may keep the
    /// system left-handed.
    void makePerpendicular(int axis, bool keepDirection);
    /// Makes each axis of length 1.
    void normalizeAxes();
    /// Sets right-handed unit axes with z along the normal of the plane, and the origin to
    /// `point`, which need not be on the plane, or to the point of the plane that is nearest to
    /// the parent's origin. An empty plane sets the origin to NaN and leaves the axes.
    void setSystemByPlane(const KpPlane& plane, const KpVec3f& point);
    /// As above.
    void setSystemByPlane(const KpPlane& plane);

    /// The origin in the parent's space.
    const KpVec3f& origin() const { return origin_; }
    /// An axis in the parent's space.
    const KpVec3f& axis(int axis) const { return axes_[static_cast<std::size_t>(axis)]; }
    /// Whether no number is NaN and the determinant of the axes is not 0.
    bool isValid() const;
    /// Whether the dot product of each two axes is within 1e-6 of 0. The lengths of the axes
    /// affect it.
    bool isPerpendicular() const;
    /// Whether the determinant of the axes is above 0.
    bool isRightHanded() const;
    /// The axes as rows.
    KpMat3f orientationAsMatrix() const { return KpMat3f(axes_); }
    /// The rotation of orientationAsMatrix(). Precondition: the axes form a rotation.
    KpRotation orientationAsQuaternion() const { return KpRotation(orientationAsMatrix()); }
    /// Whether the origins differ by less than `tolerance` in each component and equalsAxis()
    /// holds. Parents are not compared.
    bool equals(const KpCoordinateSystem& other, float tolerance) const;
    /// Whether the axes match in length and direction to about 1e-4.
    bool equalsAxis(const KpCoordinateSystem& other) const;

    /// The parent's.
    KpHandle<const KpFrameOfReference> frameOfReference() const override;
    /// The parent, null if there is none.
    KpHandle<const KpAbstractCoordinateSystem> parent() const override;
    KpMat4f asTransformation() const override;
    KpMat4f asTransformationToFrameOfReference() const override;
    /// "KpCoordinateSystem":{"origin":{...},"x_axis":{...},"y_axis":{...},"z_axis":{...},"parent": {the parent's}}
    std::string dump() const override;

    /// The transformation from this system through the matrix of `ancestor`, included, and so to
    /// the parent of `ancestor`; to the root if `ancestor` is not above this system.
    KpMat4f asTransformationUpTo(const KpAbstractCoordinateSystem& ancestor) const;
    /// This system, its parent, and so on to the root. The pointers are valid while the systems
    /// live.
    std::vector<const KpAbstractCoordinateSystem*> path() const;

    /// Whether both systems have a frame of reference with the same id.
    bool isCompatibleWith(const KpAbstractCoordinateSystem& other) const;
    /// Sets `result` to the transformation from this system to `other`. Returns false and leaves
    /// `result` unchanged if they are not compatible.
    bool transformationTo(const KpAbstractCoordinateSystem& other, KpMat4f& result) const;
    /// From `other` to this system, in the same way.
    bool transformationFrom(const KpAbstractCoordinateSystem& other, KpMat4f& result) const;
    /// The transformation from this system to `other`, or NaN in all elements if they are not
    /// compatible.
    KpMat4f transformationTo(const KpAbstractCoordinateSystem& other) const;
    /// As above.
    KpMat4f transformationFrom(const KpAbstractCoordinateSystem& other) const;
    /// The lowest system that is an ancestor of both, or one of the two itself. Null if there is
    /// none, which is possible for compatible systems too.
    ///
    /// The result is a handle, which deletes the object when it is the last one. Precondition: the
    /// result is on the heap. A system on the stack or in a member can be the result itself, as in
    /// s.commonAncestor(s); the handle would delete it. Parents are always on the heap.
    KpHandle<const KpAbstractCoordinateSystem> commonAncestor(const KpAbstractCoordinateSystem& other) const;

    /// Returns a new system at the same place whose parent is the parent's parent, or a copy if
    /// there is no parent.
    KpHandle<KpCoordinateSystem> mergedWithParent() const;
    /// Returns a new system at the same place whose parent is `other`, or a default-constructed
    /// one if they are not compatible.
    KpHandle<KpCoordinateSystem> asChildOf(const KpAbstractCoordinateSystem& other) const;

private:
    KpHandle<const KpAbstractCoordinateSystem> parent_;
    KpVec3f origin_{0, 0, 0};
    std::array<KpVec3f, 3> axes_{KpVec3f(1, 0, 0), KpVec3f(0, 1, 0), KpVec3f(0, 0, 1)};
};
