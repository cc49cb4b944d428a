#pragma once

#include "Split.h"

#include <kplib/threads/KpProgressInterface.h>

#include <string>
#include <vector>

/// The images of one series below a folder, in its volumes.
struct SeriesEntry {
    std::string uid, description, modality;
    size_t images = 0;
    std::vector<Part> volumes;
};

/// What a folder holds.
struct Scan {
    std::vector<SeriesEntry> series;    ///< by UID
    std::vector<std::string> warnings;  ///< files that are damaged or occur twice
    int otherFiles = 0;                 ///< that are not DICOM
    int otherObjects = 0;               ///< DICOM objects without images
};

/// Reads the headers of all files below `folder`. Files that cannot be read are named in warnings. On cancellation the
/// result is incomplete and `progress` says so.
KpResult scanFolder(const std::string& folder, KpProgressInterface& progress, Scan& scan);
