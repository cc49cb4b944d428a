#include "../peers/RemoteVolume.h"
#include "Commands.h"
#include "Load.h"

#include <kplib/threads/ProgressScope.h>

KpResult exportSeries(const Job& job, KpProgressInterface& progress)
{
    Series series;
    Volume volume;
    HxParamBundle root("Volume");
    const ProgressScope scope(&progress);
    progress.startWorking(3, "export");
    Road road(progress);
    loadSeries(job, road, progress, series, volume, root);
    road.plain("write", [&] { return writeRemote(job.target, job.describe, series, volume, root); });
    return road.result();
}
