#include "../peers/ExportVolume.h"
#include "Commands.h"
#include "Load.h"

#include <kplib/threads/ProgressScope.h>

KpResult exportSeries(const Job& job, KpProgressInterface& progress)
{
    Series series;
    Volume volume;
    HxParamBundle root("Volume");
    const ProgressScope scope(&progress);
    progress.startWorking(2, "export");
    Road road(progress);
    loadSeries(job, road, progress, series, volume, root);
    KpResult result = road.result();
    if (result.isOk())
        result << writeExport(job.target, job.describe, series, volume, root);
    return result;
}
