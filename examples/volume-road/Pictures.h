#pragma once

#include "OutputFolder.h"
#include "Volume.h"

#include <kplib/imaging/KpWindowLevel.h>
#include <kplib/param/HxParamBundle.h>
#include <kplib/volume/KpBitfield.h>

/// What of the displayed values becomes black and white.
struct Window {
    double center = 0, width = 1;  ///< displayed values, as in DICOM's window centre and width
    bool isInverted = false;       ///< low values are white
    const char* origin = "";       ///< where it comes from, for the report
};

/// The window from the lowest to the highest value, leaving out half a percent at either end.
Window windowOf(Volume& volume);
/// The windows of the header that can be shown.
std::vector<KpWindowLevel> presetsOf(const HxParamBundle& root);
Window windowOf(const HxParamBundle& root, const KpWindowLevel& preset);
/// The first one of the header, or else windowOf() the volume.
Window windowOf(const HxParamBundle& root, Volume& volume);

/// The volume through the window, as bytes, into `shown`, whose memory is used again. The linear function of DICOM
/// PS3.3, C.11.2.1.2.1.
void display(Volume& volume, const Window& window, Volume& shown);

/// Writes axial.png, coronal.png and sagittal.png through the middle of a volume of bytes, the patient upright and seen
/// as usual (left on the right side of the picture), with square pixels and the orientation's
/// letters at the edges. Voxels of `outline`, a mask of the volume's size, are marked.
KpResult writePlanes(Volume& shown, const KpBitfield& outline, const OutputFolder& out);

/// Writes the axial one of these pictures alone.
KpResult writeAxial(Volume& shown, const KpBitfield& outline, const OutputFolder& out, const char* name);

/// Writes all slices of a volume of bytes side by side, with the letters of a slice at the edges.
KpResult writeOverview(Volume& shown, const OutputFolder& out, const char* name);
