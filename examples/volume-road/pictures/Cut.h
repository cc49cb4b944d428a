#pragma once

#include "../volume/Space.h"
#include "Picture.h"

#include <kplib/geometry/KpBox2f.h>

/// Cuts a volume of bytes by the plane z = 0 of `plane`, a system of unit axes in the patient's space. The picture
/// shows `extent` of the plane in pixels of `pixel` mm, with the voxels of `outline` (a mask of the volume's size)
/// marked and the letters of the plane at its edges. Values are interpolated between the eight voxels around a place,
/// wherever the slices lie: tilted scans and uneven gaps are shown undistorted.
Picture cutByPlane(const Volume& shown, const Space& space, const KpBitfield& outline, const KpCoordinateSystem& plane,
                   const KpBox2f& extent, double pixel);
