#pragma once

#include <kplib/foundation/KpExport.h>

class KpPlane;
class KpVec3f;

// Comparison of floats with a tolerance. Without the argument `eps` the tolerance is relative to
// the smaller of the two magnitudes. NaN matches nothing.

/// Whether the difference is at most a ten-thousandth of the smaller magnitude. There is no
/// absolute tolerance: 0 matches 0 only.
KPLIB_API bool kpFuzzyCompare(float a, float b);
/// Whether the difference is at most `eps`.
KPLIB_API bool kpFuzzyCompare(float a, float b, float eps);

/// Whether the distance of the two is at most a ten-thousandth of the smaller length, or 1e-6 if
/// that length is 0.
KPLIB_API bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b);
/// Whether the distance of the two is at most the magnitude of `eps`.
KPLIB_API bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b, float eps);

/// Whether the normals match as vectors do without a tolerance and the distances from the origin
/// match with `eps`. The same plane with the opposite normal matches if neither distance is 0.
KPLIB_API bool kpFuzzyCompare(const KpPlane& a, const KpPlane& b, float eps);
