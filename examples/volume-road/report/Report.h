#pragma once

#include "../dicom/Series.h"
#include "../volume/Segment.h"
#include "Lines.h"

#include <string>
#include <vector>

/// One stage of the road and how long it took.
struct Stage {
    const char* name;
    double seconds;
};

/// What a report is about.
struct Findings {
    const HxParamBundle& root;
    const Series& series;
    Volume& volume;
    const Window& window;
    const Region& region;
    const std::string& derivedUid;  ///< of the derived series; empty if there is none
    const std::vector<Stage>& stages;
};

using Report = Lines;

/// Everything but what identifies the patient.
Report makeReport(const Findings& findings);

/// Writes header.txt: the whole tree in its text form, with the index of private creators.
KpResult writeHeader(const HxParamBundle& root, const OutputFolder& out);

/// Writes report.txt and report.json.
KpResult writeReport(const Report& report, const OutputFolder& out);

/// The peak memory of the process, and how many times the voxels' memory that is.
std::string memoryLine(const Volume& volume);
