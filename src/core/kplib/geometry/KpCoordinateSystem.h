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

/// A coordinate system in the space of its parent: an origin and three axes, which need not be of length 1 or at right
/// angles. The point (u, v, w) is at origin + u x + v y + w z in the parent's space.
///
///     KpHandle<KpFrameOfReference> patient(new KpFrameOfReference("1.2.3"));
///     KpHandle<KpCoordinateSystem> slices = patient->createChildSystem();
///     slices->setOrigin(KpVec3f(-120, -100, 40));
///     slices->setAxis(KpCoordinateSystem::AxisZ, KpVec3f(0, 0, 2));
///     const KpMat4f toPatient = slices->asTransformationToFrameOfReference();
///     const KpVec3f place = toPatient.multVecMatrix(KpVec3f(0, 0, 3));
///     std::printf("slice 3 is at z = %g\n", double(place.z()));  // prints: slice 3 is at z = 46
///
/// Without a parent it floats: it has no frame of reference and is compatible with nothing, itself
/// included. Input from which no system can be made leaves NaN in the numbers: isValid() is false
/// then. There are no other errors. For ownership see KpAbstractCoordinateSystem.
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

    /// Null makes it float. The caller ensures that no system is its own ancestor.
    void setParent(const KpAbstractCoordinateSystem* parent) { parent_ = parent; }
    /// Replaces the origin.
    void setOrigin(const KpVec3f& origin) { origin_ = origin; }
    /// Replaces one axis.
    void setAxis(int axis, const KpVec3f& value) { axes_[static_cast<std::size_t>(axis)] = value; }
    /// Replaces the axes.
    void setAxes(const std::array<KpVec3f, 3>& axes) { axes_ = axes; }
    /// Right-handed unit axes at right angles, with z along `zAxis` and x as near to `xHint` as can be; any x if
    /// `xHint` is zero. An `xHint` along `zAxis` leaves x and y zero.
    void setAxes(const KpVec3f& zAxis, const KpVec3f& xHint);
    /// The unit axes turned by `rotation`.
    void setAxesByRotation(const KpRotation& rotation);
    /// Keeps `axis` and brings the two others to right angles with it and each other; their lengths change.
    /// With `keepDirection` neither turns by more than a right angle, which may keep the system left-handed.
    void makePerpendicular(int axis, bool keepDirection);
    /// Makes each axis of length 1.
    void normalizeAxes();
    /// Right-handed unit axes with z along the normal and the origin at `point`, wherever that is, or at the plane's
    /// point nearest to the parent's origin. An empty plane makes the origin NaN and leaves the axes.
    void setSystemByPlane(const KpPlane& plane, const KpVec3f& point);
    /// As above.
    void setSystemByPlane(const KpPlane& plane);

    /// The origin in the parent's space.
    const KpVec3f& origin() const { return origin_; }
    /// An axis in the parent's space.
    const KpVec3f& axis(int axis) const { return axes_[static_cast<std::size_t>(axis)]; }
    /// No number is NaN, and the determinant of the axes is not 0.
    bool isValid() const;
    /// Each two axes have a dot product within 1e-6 of 0; their lengths count.
    bool isPerpendicular() const;
    /// Whether the determinant of the axes is above 0.
    bool isRightHanded() const;
    /// The axes as rows.
    KpMat3f orientationAsMatrix() const { return KpMat3f(axes_); }
    /// The rotation of that matrix; the axes have to be one.
    KpRotation orientationAsQuaternion() const { return KpRotation(orientationAsMatrix()); }
    /// Origins within, but not at, `tolerance` in each component, and equalsAxis(). Parents play no part.
    bool equals(const KpCoordinateSystem& other, float tolerance) const;
    /// Axes that match in length and direction, to about 1e-4.
    bool equalsAxis(const KpCoordinateSystem& other) const;

    /// The parent's.
    KpHandle<const KpFrameOfReference> frameOfReference() const override;
    /// The parent, null if there is none.
    KpHandle<const KpAbstractCoordinateSystem> parent() const override;
    KpMat4f asTransformation() const override;
    KpMat4f asTransformationToFrameOfReference() const override;
    /// "KpCoordinateSystem":{"origin":{...},"x_axis":{...},"y_axis":{...},"z_axis":{...},"parent": {the parent's}}
    std::string dump() const override;

    /// From this system through the matrix of `ancestor`, which is included, and so to the parent of `ancestor`; to the
    /// root if `ancestor` is not above.
    KpMat4f asTransformationUpTo(const KpAbstractCoordinateSystem& ancestor) const;
    /// This system, its parent, and so on; as long as the systems live.
    std::vector<const KpAbstractCoordinateSystem*> path() const;

    /// Whether both have a frame of reference, and the same one by its id.
    bool isCompatibleWith(const KpAbstractCoordinateSystem& other) const;
    /// From this system to `other`. False, and `result` unwritten, if they are not compatible.
    bool transformationTo(const KpAbstractCoordinateSystem& other, KpMat4f& result) const;
    /// From `other` to this system, in the same way.
    bool transformationFrom(const KpAbstractCoordinateSystem& other, KpMat4f& result) const;
    /// The same for callers that know isCompatibleWith(); NaN throughout if they are not.
    KpMat4f transformationTo(const KpAbstractCoordinateSystem& other) const;
    /// As above.
    KpMat4f transformationFrom(const KpAbstractCoordinateSystem& other) const;
    /// The lowest system that is above both or one of the two; null if there is none, which may be so for compatible
    /// ones too.
    ///
    /// The result is held by a handle, which deletes the object with the last handle to it. Do not call this for a
    /// system on the stack or in a member that may be the result itself, such as in s.commonAncestor(s): the handle
    /// would delete it. Parents live on the heap anyway.
    KpHandle<const KpAbstractCoordinateSystem> commonAncestor(const KpAbstractCoordinateSystem& other) const;

    /// A new system in the same place whose parent is the parent's parent; a copy if there is no parent.
    KpHandle<KpCoordinateSystem> mergedWithParent() const;
    /// A new system in the same place whose parent is `other`; a default-made one if they are not compatible.
    KpHandle<KpCoordinateSystem> asChildOf(const KpAbstractCoordinateSystem& other) const;

private:
    KpHandle<const KpAbstractCoordinateSystem> parent_;
    KpVec3f origin_{0, 0, 0};
    std::array<KpVec3f, 3> axes_{KpVec3f(1, 0, 0), KpVec3f(0, 1, 0), KpVec3f(0, 0, 1)};
};
