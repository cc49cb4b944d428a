#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

/// Functions of vectors. All are pure.
namespace MathUtils {

/// The rotation angle from `a` to `b` about the axis `reference`, in radians in [0, 2 pi). The
/// lengths have no effect. If `reference` is not orthogonal to both, it determines the sign and
/// the weight of the sine.
KPLIB_API float angleBetweenVectors(const KpVec3f& a, const KpVec3f& b, const KpVec3f& reference);

/// Whether the angle between the two is less than a right one.
KPLIB_API bool haveSameSpaceOrientation(const KpVec3f& a, const KpVec3f& b);

/// Whether the sine of the angle between the two is strictly below `tolerance`. Opposite vectors are parallel, the zero
/// vector is parallel to any.
KPLIB_API bool areParallel(const KpVec3f& a, const KpVec3f& b, float tolerance);

/// Whether the determinant of the three is not exactly 0; there is no tolerance.
KPLIB_API bool areLinearlyIndependent(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c);

/// Whether the dot product lies strictly between -1e-6 and 1e-6. The lengths affect it: this is
/// not a test of the angle only.
KPLIB_API bool arePerpendicular(const KpVec3f& a, const KpVec3f& b);

/// A vector orthogonal to `v`, not of length 1: `v` cross the axis of its smallest component, the
/// first one if several are equal. The zero vector for the zero vector.
KPLIB_API KpVec3f getPerpendicularVector(const KpVec3f& v);

}  // namespace MathUtils
