#pragma once

#include "Volume.h"

#include <kplib/geometry/KpCoordinateSystem.h>
#include <kplib/geometry/KpFrameOfReference.h>
#include <kplib/imaging/KpOrientationLetters.h>

#include <string>

/// The patient's space of a series: its frame of reference, and in it the system of the voxels, in which the middle of
/// voxel (x, y, z) is the point (x, y, z).
struct Space {
    KpHandle<const KpFrameOfReference> patient;
    KpHandle<KpCoordinateSystem> voxels;

    Space(const std::string& frameUid, const Volume& volume);
};

inline KpVec3f toVec(const Vector& v)
{
    return {static_cast<float>(v[0]), static_cast<float>(v[1]), static_cast<float>(v[2])};
}

/// The letters of a picture of the volume that shows `right` and `down`, directions in the patient, at these edges.
/// None if nothing tells how the patient lies: wrong letters are worse.
KpOrientationLetters lettersOf(const Volume& volume, const KpVec3f& right, const KpVec3f& down);
