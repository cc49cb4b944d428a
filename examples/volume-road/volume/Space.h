#pragma once

#include "Volume.h"

#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/imaging/KpOrientationLetters.h>

#include <string>

/// The patient's space of a series: its frame of reference, and in it the system of the voxels, in which the middle of
/// voxel (x, y, z) is the point (x, y, height(z) / spacing[2]): (x, y, z) if the gaps are even.
struct Space {
    KpHandle<const KpFrameOfReference> patient;
    KpHandle<KpCoordinateSystem> voxels;

    Space(const std::string& frameUid, const Volume& volume);
};

/// The letters of a picture of the volume that shows `right` and `down`, directions in the patient, at these edges.
/// Empty if the position of the patient is unknown, since wrong letters would mislead.
KpOrientationLetters lettersOf(const Volume& volume, const KpVec3f& right, const KpVec3f& down);
