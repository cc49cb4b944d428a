#pragma once

#include "DicomSeries.h"
#include "OutputFolder.h"
#include "Pictures.h"
#include "Segment.h"

/// One stage of the road and how long it took.
struct Stage {
    const char* name;
    double seconds;
};

KpResult writeText(const KpString& text, const OutputFolder& out, const char* name);

/// Writes header.txt: the whole tree in its text form, with the index of private creators.
KpResult writeHeader(const HxParamBundle& root, const OutputFolder& out);

/// Writes report.txt: what can be told without telling who the patient is. `derivedUid`: of the derived series, if
/// there is one.
KpResult writeReport(const HxParamBundle& root, const Series& series, Volume& volume, const Window& window,
                     const Region& region, const std::string& derivedUid, const std::vector<Stage>& stages,
                     const OutputFolder& out);
