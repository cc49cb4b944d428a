#include "RunRoad.h"

#include "DerivedSeries.h"
#include "DicomSeries.h"
#include "JobLog.h"
#include "Oblique.h"
#include "Reduce.h"
#include "RemoteVolume.h"
#include "Road.h"
#include "Segment.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/threads/ProgressScope.h>

#include <cstdio>

namespace {

void readVolume(const Job& job, Road& road, KpProgressInterface& progress, Series& series, Volume& volume,
                HxParamBundle& root)
{
    if (!job.url.empty()) {
        progress.nextStep();
        road.nested("read slices over HTTP", [&] { return readRemote(job.url, progress, series, volume, root); });
        return;
    }
    road.nested("look for images", [&] { return scanSeries(job.folder.c_str(), job.uid, progress, series); });
    for (const std::string& warning : series.warnings) {
        std::fprintf(stderr, "volume-road: warning: %s\n", warning.c_str());
        getTheLogInstance().warn(nullptr, warning.c_str());
    }
    road.nested("read images", [&] { return readSeries(series, progress, volume, root); });
}

/// One picture for each window of the header.
KpResult writePresets(const HxParamBundle& root, Volume& volume, const KpBitfield& outline, const OutputFolder& out)
{
    KpResult result;
    Volume shown;
    int number = 0;
    for (const KpWindowLevel& preset : presetsOf(root)) {
        display(volume, windowOf(root, preset), shown);
        result << writeAxial(shown, outline, out, KpString(0, "preset-%d.png", ++number));
    }
    return result;
}

}  // namespace

KpResult runRoad(const Job& job, const std::string& target, KpProgressInterface& progress)
{
    OutputFolder out, derived;
    KpResult opened = out.open(target);
    if (!job.derived.empty())
        opened << derived.open(job.derived);
    if (opened.isBad())
        return opened;
    const ProgressScope scope(&progress);
    const JobLog log(out.working());
    progress.startWorking(job.derived.empty() ? 10 : 11, "");
    Road road(progress);
    Series series;
    HxParamBundle root("Volume");
    Volume volume, mean, maximum, shown;
    Window window;
    readVolume(job, road, progress, series, volume, root);
    road.nested("reduce by mean", [&] {
        mean = reducedByMean(volume, {2, 2, 2}, progress);
        return KpResult();
    });
    road.nested("reduce by maximum", [&] {
        maximum = reducedByMaximum(volume, {4, 4, 4}, progress);
        return KpResult();
    });
    std::optional<Space> space;
    Region region;
    road.nested("segment", [&] {
        space.emplace(series.frameUid(), volume);
        return segment(volume, *space, job.threshold, progress, region);
    });
    road.plain("draw planes", [&] {
        window = windowOf(root, mean);
        display(volume, window, shown);
        return writePlanes(shown, region.outline, out);
    });
    road.plain("draw presets", [&] { return writePresets(root, volume, region.outline, out); });
    road.plain("cut obliquely", [&] { return writeOblique(shown, *space, region.outline, out); });
    road.plain("draw overviews", [&] {
        display(mean, window, shown);
        KpResult written = writeOverview(shown, out, "overview-mean.png");
        display(maximum, window, shown);
        written << writeOverview(shown, out, "overview-maximum.png");
        return written;
    });
    std::string derivedUid;
    if (!job.derived.empty())
        road.nested("write derived series",
                    [&] { return writeDerived(mean, series, 2, derived.working(), progress, derivedUid); });
    road.plain("write texts", [&] {
        KpResult written = writeHeader(root, out);
        written << writeReport(root, series, volume, window, region, derivedUid, road.stages(), out);
        return written;
    });
    KpResult result = road.result();
    if (result.isOk())
        result << out.publish();
    if (result.isOk() && !job.derived.empty())
        result << derived.publish();
    return result;
}
