#pragma once

#include "Report.h"

/// Writes index.html: one file that shows the volume in three planes, with its windows, the region, the report and the
/// warnings, in any browser and without a network. Large volumes are shown reduced.
KpResult writePage(Volume& volume, const Space& space, const Region& region, const Series& series, const Window& window,
                   const Report& report, const OutputFolder& out);
