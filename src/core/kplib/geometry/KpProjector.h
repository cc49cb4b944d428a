#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpLine.h>
#include <kplib/geometry/KpMat4f.h>
#include <kplib/geometry/KpVec2f.h>
#include <kplib/geometry/KpVec3f.h>
#include <kplib/geometry/KpViewVolume.h>

/// Maps positions of a pointer on the screen to positions in a working space, for handles that are
/// dragged.
///
/// One thread at a time. Errors are not reported: without a result the output is NaN.
class KPLIB_API KpProjector {
public:
    /// The position in working space for `point` on the screen, from (0, 0) at the lower left to (1, 1).
    virtual KpVec3f project(const KpVec2f& point) = 0;
    /// The same for a line in the world.
    virtual KpVec3f intersect(const KpLine& line) = 0;
    /// Sets what the camera sees.
    virtual void setViewVolume(const KpViewVolume& viewVolume);
    /// From the working space to the world; the identity at the start.
    virtual void setWorkingSpace(const KpMat4f& workingToWorld);
    /// A new object in the same state, which the caller owns and deletes.
    virtual KpProjector* copy() const = 0;
    virtual ~KpProjector();

    /// @{
    /// As it was set.
    const KpViewVolume& viewVolume() const { return viewVolume_; }
    const KpMat4f& worldToWorking() const { return worldToWorking_; }
    const KpMat4f& workingToWorld() const { return workingToWorld_; }
    /// @}

    /// The line of sight through `point` of the screen, in working space.
    KpLine getWorkingLine(const KpVec2f& point) const;

protected:
    KpProjector() = default;
    /// @{
    /// Copies the state.
    KpProjector(const KpProjector&) = default;
    KpProjector& operator=(const KpProjector&) = default;
    /// @}

    /// A line of the world in working space.
    KpLine toWorkingSpace(const KpLine& worldLine) const;

private:
    KpViewVolume viewVolume_;
    KpMat4f worldToWorking_ = KpMat4f::identity(), workingToWorld_ = KpMat4f::identity();
};
