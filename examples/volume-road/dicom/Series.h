#pragma once

#include "../pictures/Window.h"
#include "Geometry.h"
#include "Scan.h"

#include <kplib/param/HxParamBundle.h>

#include <string>
#include <vector>

/// One volume of a series: its planes in order, and what was found about it.
struct Series {
    std::vector<Image> planes;
    std::string label;  ///< what distinguishes it from other volumes of its series; empty if there are none
    size_t volume = 1, volumes = 1;  ///< number of this one, and of all in the series
    std::vector<std::string> warnings;
    int skippedFiles = 0;  ///< files that are not DICOM
    Geometry geometry;
    Windows windows;

    /// The frame of reference that the images name; without such a name each series is a space of its own.
    const std::string& frameUid() const
    {
        const Image& first = planes.front();
        return first.frameUid.empty() ? first.seriesUid : first.frameUid;
    }
};

/// Which volume of a folder is read.
struct Choice {
    std::string folder;
    std::string uid;  ///< of the series, where the folder holds several
    int volume = 0;   ///< from 1; the first, with a warning if there are others, if 0
};

/// What is known of a volume without reading its voxels: geometry, windows and warnings. A failure if it cannot be
/// read.
KpResult inspect(Part part, Series& series);

/// Finds the images below a folder and picks one volume of one series.
KpResult scanSeries(const Choice& choice, KpProgressInterface& progress, Series& series);

/// Reads the voxels into one block, and the header of the first image into `root`, with what differs from image to
/// image beside it. On cancellation the volume is incomplete and `progress` says so.
KpResult readSeries(const Series& series, KpProgressInterface& progress, Volume& volume, HxParamBundle& root);
