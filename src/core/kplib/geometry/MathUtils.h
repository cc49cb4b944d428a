#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

/// Questions about vectors. All are pure functions.
namespace MathUtils {

/// The turn from `a` to `b` about the axis `reference`, in radians from 0 up to but without 2 pi. The lengths don't
/// matter; where `reference` is not at a right angle to both, it decides the sign and how much the turn counts.
KPLIB_API float angleBetweenVectors(const KpVec3f& a, const KpVec3f& b, const KpVec3f& reference);

/// Whether the angle between the two is less than a right one.
KPLIB_API bool haveSameSpaceOrientation(const KpVec3f& a, const KpVec3f& b);

/// Whether the sine of the angle between the two is strictly below `tolerance`. Opposite vectors are parallel, the zero
/// vector is parallel to any.
KPLIB_API bool areParallel(const KpVec3f& a, const KpVec3f& b, float tolerance);

/// Whether the determinant of the three is not exactly 0; there is no tolerance.
KPLIB_API bool areLinearlyIndependent(const KpVec3f& a, const KpVec3f& b, const KpVec3f& c);

/// Whether the dot product lies strictly between -1e-6 and 1e-6. The lengths count: this is not a test of the angle
/// alone.
KPLIB_API bool arePerpendicular(const KpVec3f& a, const KpVec3f& b);

/// A vector at a right angle to `v`, not of length 1: `v` cross the axis of its smallest component, the first of
/// equals. Zero for the zero vector, which has none.
KPLIB_API KpVec3f getPerpendicularVector(const KpVec3f& v);

}  // namespace MathUtils
