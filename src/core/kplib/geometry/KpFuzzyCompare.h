#pragma once

#include <kplib/foundation/KpExport.h>

class KpPlane;
class KpVec3f;

// Comparison of floats with a tolerance. The forms without a given one are relative to the smaller of the two
// magnitudes. NaN matches nothing.

/// Whether a ten-thousandth of the smaller magnitude is at or above the difference. There is no
/// floor: 0 matches 0 alone.
KPLIB_API bool kpFuzzyCompare(float a, float b);
/// Whether `eps` is at or above the difference.
KPLIB_API bool kpFuzzyCompare(float a, float b, float eps);

/// Whether a ten-thousandth of the smaller length, or 1e-6 if that is 0, is at or above the distance of the two.
KPLIB_API bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b);
/// Whether `eps`, whatever its sign, is at or above the distance of the two.
KPLIB_API bool kpFuzzyCompare(const KpVec3f& a, const KpVec3f& b, float eps);

/// Whether the normals match as vectors do without a tolerance and the distances from the origin with `eps`; one that
/// faces the other side of the same plane matches, if neither distance is 0.
KPLIB_API bool kpFuzzyCompare(const KpPlane& a, const KpPlane& b, float eps);
