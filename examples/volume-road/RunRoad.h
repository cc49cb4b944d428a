#pragma once

#include <kplib/log/KpResult.h>
#include <kplib/threads/KpProgressInterface.h>

#include <optional>
#include <string>

/// Where the volume of the main job comes from, and what is to be done with it.
struct Job {
    std::string folder;               ///< of a series in DICOM files, or else
    std::string url;                  ///< of a volume that exportVolume() has written, on an HTTP server
    std::string uid;                  ///< of the series, where the folder holds several
    std::optional<double> threshold;  ///< displayed value from which on voxels belong to the object
    std::string derived;              ///< folder for the reduced volume as a DICOM series; none if empty
};

/// The main job: reads a volume, reduces, segments and shows it, and writes pictures, header, report and log into
/// `target`, all or nothing; and the derived series, if it is asked for. A failure's text is one line for the user; a
/// cancelled job is code Interrupted.
KpResult runRoad(const Job& job, const std::string& target, KpProgressInterface& progress);
