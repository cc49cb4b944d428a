#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpBox3f.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpPlane.h>
#include <kplib/geometry/KpRotation.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>

#include <cstdint>

/// The volume that a camera sees: a box or a frustum in the world, for picking, projection and
/// culling.
///
/// Screen coordinates go from (0, 0) at the lower left of the viewport to (1, 1) at the upper
/// right. A plain value. The shape is undefined until ortho(), perspective() or frustum() is
/// called. Errors are not reported: a degenerate volume divides by zero and returns NaN.
class KPLIB_API KpViewVolume {
public:
    /// How points are projected.
    enum Type : std::int32_t {
        Orthographic,  ///< along parallel lines
        Perspective,   ///< toward the eye
    };

    KpViewVolume() = default;

    // The next three place the eye at the origin, looking along -z. The rectangle is the one at
    // the near plane. Stereo and camera offset stay.

    /// A box between these bounds.
    void ortho(float left, float right, float bottom, float top, float near, float far);
    /// `fovy` is the angle between bottom and top in radians, `aspect` the width over the height.
    void perspective(float fovy, float aspect, float near, float far);
    /// The near rectangle is at z = +near: pass negative `near` and `far` for a volume in front of
    /// the eye.
    void frustum(float left, float right, float bottom, float top, float near, float far);

    /// Moves the eye and the volume.
    void translateCamera(const KpVec3f& translation);
    /// About the eye.
    void rotateCamera(const KpRotation& rotation);
    /// Scales the near rectangle about its centre by abs(factor) in width, height or both.
    void scale(float factor);
    /// @{
    /// As above, in one direction.
    void scaleWidth(float factor);
    void scaleHeight(float factor);
    /// @}

    /// Transforms the volume by `matrix`. Under a reflection left and right are exchanged, so that
    /// the rectangle stays right-handed as seen from the eye. Stereo and camera offset are reset
    /// to their defaults.
    void transform(const KpMat4f& matrix);

    /// The part of the volume that projects to a rectangle on the screen.
    KpViewVolume narrow(float left, float bottom, float right, float top) const;
    /// The part between two depths, fractions from 1 at the near plane to 0 at the far plane. The
    /// clamped value of `near` itself becomes nearDist(). Stereo and camera offset are reset to
    /// their defaults.
    KpViewVolume zNarrow(float near, float far) const;
    /// Both: x and y of `box` are the rectangle, zmax is near and zmin is far.
    KpViewVolume narrow(const KpBox3f& box) const;

    /// From the world to a camera at the origin that looks along -z, and from there to normalised device coordinates,
    /// -1 to 1 on each axis.
    void getMatrices(KpMat4f& affine, KpMat4f& proj) const;
    /// The product of the two.
    KpMat4f getMatrix() const;
    /// Moves the eye to the origin and rotates the viewing direction to -z the shortest way,
    /// regardless of the up direction.
    KpMat4f getCameraSpaceMatrix() const;

    /// The points of the near and the far plane that are seen at `point` of the screen, and the line through them.
    void projectPointToLine(const KpVec2f& point, KpVec3f& near, KpVec3f& far) const;
    /// @{
    /// The same as a line.
    void projectPointToLine(const KpVec2f& point, KpLine& line) const;
    KpLine projectPointToLine(const KpVec2f& point) const;
    /// @}

    /// z is the depth from 0 at the near plane to 1 at the far one.
    void projectToScreen(const KpVec3f& world, KpVec3f& screen) const;
    /// Width and height on the screen of the eight corners' bounding rectangle.
    KpVec2f projectBox(const KpBox3f& box) const;
    /// The plane at `distance` from the eye that faces it.
    KpPlane getPlane(float distance) const;
    /// The point at `distance` along the viewing direction from the eye.
    KpVec3f getSightPoint(float distance) const { return projPoint_ + projDir_ * distance; }
    /// The point of getPlane() that projects to `point` of the screen.
    KpVec3f getPlanePoint(float distance, const KpVec2f& point) const;
    /// The unit vector from the near rectangle toward the viewer.
    KpVec3f zVector() const;
    /// The rotation that turns y and x of the world to the up and right directions of the view;
    /// with `rightAngleOnly` only by right angles.
    KpRotation getAlignRotation(bool rightAngleOnly) const;
    /// The length of a segment at `center` that spans `normRadius` of the screen, for handles of
    /// constant size. A position off the screen is measured at its border. Returns 1 if there is
    /// no result.
    float getWorldToScreenScale(const KpVec3f& center, float normRadius) const;

    /// Whether the point is in the volume, faces included. False for each point if nearDist() and
    /// nearToFar() are 0.
    bool intersect(const KpVec3f& point) const;
    /// Sets `out` to the point of the segment that is nearest to the central line of the volume,
    /// and returns whether it is in the volume. Returns false for a segment that is parallel to
    /// that line, with NaN in `out`, and for a segment whose unbounded line is nearest beyond its
    /// ends.
    bool intersect(const KpVec3f& p0, const KpVec3f& p1, KpVec3f& out) const;
    /// Whether the box may be in the volume: false if it lies wholly outside one face or is empty.
    /// True also for some boxes outside, near the edges of the volume.
    bool intersect(const KpBox3f& box) const;
    /// Whether the box from `min` to `max` lies wholly on the side that the normal of the plane
    /// does not point to.
    static bool outsideTest(const KpPlane& plane, const KpVec3f& min, const KpVec3f& max);

    /// How points are projected.
    Type type() const { return type_; }
    const KpVec3f& projPoint() const { return projPoint_; }  ///< the eye, or a point on the central axis
    const KpVec3f& projDir() const { return projDir_; }      ///< of length 1
    float nearDist() const { return nearDist_; }             ///< of the near plane from the eye
    float nearToFar() const { return nearToFar_; }           ///< from the near plane to the far one
    // The lower left, lower right and upper left corner of the near rectangle: in the world, and relative to the eye.
    /// @{
    /// A corner.
    const KpVec3f& llf() const { return llf_; }
    const KpVec3f& lrf() const { return lrf_; }
    const KpVec3f& ulf() const { return ulf_; }
    const KpVec3f& llfO() const { return llfO_; }
    const KpVec3f& lrfO() const { return lrfO_; }
    const KpVec3f& ulfO() const { return ulfO_; }
    /// @}

    // Stereo, for a perspective only. Mode 0 is off, 1 is one eye and any other value the other
    // eye. The scales apply to the distance of the eyes and to the offset that follows from it.
    /// @{
    /// Scale of the distance of the eyes.
    float stereoEyeScale() const { return stereoEyeScale_; }
    void setStereoEyeScale(float scale) { stereoEyeScale_ = scale; }
    /// @}

    /// Scale of the offset that follows from it.
    float stereoOffsetScale() const { return stereoOffsetScale_; }
    /// As above.
    void setStereoOffsetScale(float scale) { stereoOffsetScale_ = scale; }
    /// Which eye: 0 for none.
    std::int32_t stereoMode() const { return stereoMode_; }
    /// As above.
    void setStereoMode(std::int32_t mode) { stereoMode_ = mode; }

    // The offset of the eye, in place of the one that stereo computes; 0 if it is not set.
    /// Whether there is such an offset.
    bool isCameraOffsetSet() const { return cameraOffsetIsSet_ != 0; }
    /// The offset.
    float getCameraOffset() const { return cameraOffset_; }
    /// Sets the offset.
    void setCameraOffset(float offset);
    /// Returns to the offset that stereo computes.
    void unsetCameraOffset();

private:
    void setShape(Type type, const KpVec3f& llf, const KpVec3f& lrf, const KpVec3f& ulf, float near, float far);
    void rebuildCorners();
    void moveSidesIn(const KpVec3f& step);
    void moveBottomAndTopIn(const KpVec3f& step);
    KpVec3f width() const { return lrfO_ - llfO_; }
    KpVec3f height() const { return ulfO_ - llfO_; }
    KpPlane face(int i) const;
    float stereoShift(float width) const;

    Type type_ = Orthographic;
    KpVec3f projPoint_{0, 0, 0}, projDir_{0, 0, 0};
    float nearDist_ = 0, nearToFar_ = 0;
    KpVec3f llf_{0, 0, 0}, lrf_{0, 0, 0}, ulf_{0, 0, 0};  // always the eye and the three below
    KpVec3f llfO_{0, 0, 0}, lrfO_{0, 0, 0}, ulfO_{0, 0, 0};
    float stereoEyeScale_ = 1, stereoOffsetScale_ = 1;
    std::int32_t stereoMode_ = 0;
    float cameraOffset_ = 0;
    std::int32_t cameraOffsetIsSet_ = 0;
};

static_assert(sizeof(KpViewVolume) == 128);
