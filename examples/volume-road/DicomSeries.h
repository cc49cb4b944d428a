#pragma once

#include "Volume.h"

#include <kplib/param/HxParamBundle.h>
#include <kplib/threads/KpProgressInterface.h>

#include <string>
#include <vector>

/// One image of a series, as its header tells.
struct SliceFile {
    std::string path, seriesUid, seriesDescription, instanceUid, frameUid, transferSyntax;
    bool isCompressed = false, isColour = false, hasPlace = false, isInverted = false;
    int rows = 0, columns = 0, frames = 1, bitsAllocated = 0, bitsStored = 0, highBit = 0, isSigned = 0, number = 0;
    Vector position{}, rowAxis{1, 0, 0}, columnAxis{0, 1, 0};
    double rowSpacing = 1, columnSpacing = 1, thickness = 1;
    double slope = 1, intercept = 0;

    Vector normal() const { return cross(rowAxis, columnAxis); }
    double place() const { return hasPlace ? dot(position, normal()) : number; }
};

/// The images of one series in a folder, sorted along their normal.
struct Series {
    std::vector<SliceFile> slices;
    std::vector<std::string> warnings;
    double spacing = 1;    ///< mm along the normal
    int skippedFiles = 0;  ///< files that are no images

    /// What the images name as the space they lie in; without such a name each series is a space of its own.
    const std::string& frameUid() const
    {
        const SliceFile& first = slices.front();
        return first.frameUid.empty() ? first.seriesUid : first.frameUid;
    }
};

/// Finds the images below `folder` and picks one series: the only one, or that of `uid`. All images of it must agree in
/// size, type and orientation; gaps are warnings.
KpResult scanSeries(const char* folder, const std::string& uid, KpProgressInterface& progress, Series& series);

/// Reads the voxels into one block, and the header of the first image into `root`, with what differs from image to
/// image beside it. On cancellation the volume is incomplete and `progress` says so.
KpResult readSeries(const Series& series, KpProgressInterface& progress, Volume& volume, HxParamBundle& root);
