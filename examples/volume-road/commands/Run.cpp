#include "../dicom/DerivedSeries.h"
#include "../peers/RemoteVolume.h"
#include "../pictures/Oblique.h"
#include "../pictures/Pictures.h"
#include "../report/Page.h"
#include "../report/Report.h"
#include "../volume/Reduce.h"
#include "Commands.h"
#include "JobLog.h"
#include "Load.h"

#include <kplib/threads/ProgressScope.h>

#include <cstdio>
#include <optional>
#include <string>
#include <vector>

namespace {

/// A volume and what the stages of the road make of it.
struct Work {
    Series series;
    HxParamBundle root{"Volume"};
    Volume volume, mean, maximum, shown;
    Window window;
    std::optional<Space> space;
    Region region;
    std::string derivedUid;
};

void readVolume(const Job& job, Road& road, KpProgressInterface& progress, Work& work)
{
    if (job.url.empty()) {
        loadSeries(job, road, progress, work.series, work.volume, work.root);
        return;
    }
    progress.nextStep();
    road.nested("read slices over HTTP",
                [&] { return readRemote(job.url, job.timeout, progress, work.series, work.volume, work.root); });
    printWarnings(work.series.warnings);
}

/// One picture for each window of the header.
KpResult writePresets(Work& work, const OutputFolder& out)
{
    KpResult result;
    if (work.volume.components == 3)
        return result;
    int number = 0;
    for (const KpWindowLevel& preset : work.series.windows.presets) {
        display(work.volume, work.series.windows.of(preset), work.shown);
        result << writeAxial(work.shown, *work.space, work.region.outline, out, KpString(0, "preset-%d.png", ++number));
    }
    return result;
}

void drawPictures(Road& road, Work& work, const OutputFolder& out)
{
    road.plain("draw presets", [&] { return writePresets(work, out); });
    road.plain("draw planes", [&] {
        display(work.volume, work.window, work.shown);
        return writePlanes(work.shown, *work.space, work.region.outline, out);
    });
    road.plain("cut obliquely", [&] { return writeOblique(work.shown, *work.space, work.region.outline, out); });
    road.plain("draw overviews", [&] {
        display(work.mean, work.window, work.shown);
        KpResult written = writeOverview(work.shown, out, "overview-mean.png");
        display(work.maximum, work.window, work.shown);
        written << writeOverview(work.shown, out, "overview-maximum.png");
        return written;
    });
}

/// Segmentation needs the most memory: the smaller volumes are made after it.
void workOnVolume(const Job& job, Road& road, KpProgressInterface& progress, Work& work)
{
    road.nested("segment", [&] {
        work.space.emplace(work.series.frameUid(), work.volume);
        return segment(work.volume, *work.space, job.threshold, progress, work.region);
    });
    road.nested("reduce by mean", [&] {
        work.mean = reducedByMean(work.volume, {2, 2, 2}, progress);
        work.window = windowOf(work.series.windows, work.mean);
        return KpResult();
    });
    road.nested("reduce by maximum", [&] {
        work.maximum = reducedByMaximum(work.volume, {4, 4, 4}, progress);
        return KpResult();
    });
}

KpResult writeTexts(Work& work, const std::vector<Stage>& stages, const OutputFolder& out)
{
    const Report report =
        makeReport({work.root, work.series, work.volume, work.window, work.region, work.derivedUid, stages});
    KpResult written = writeHeader(work.root, out);
    written << writeReport(report, out);
    written << writePage(work.volume, *work.space, work.region, work.series, work.window, report, out);
    return written;
}

}  // namespace

KpResult run(const Job& job, KpProgressInterface& progress)
{
    OutputFolder out, derived;
    KpResult opened = out.open(job.target);
    if (!job.derived.empty())
        opened << derived.open(job.derived);
    if (opened.isBad())
        return opened;
    const ProgressScope scope(&progress);
    const JobLog log(out.working());
    progress.startWorking(job.derived.empty() ? 10 : 11, "");
    Road road(progress);
    Work work;
    readVolume(job, road, progress, work);
    workOnVolume(job, road, progress, work);
    drawPictures(road, work, out);
    if (!job.derived.empty())
        road.nested("write derived series", [&] {
            return writeDerived(work.mean, work.series, 2, derived.working(), progress, work.derivedUid);
        });
    work.shown = Volume();
    road.plain("write texts", [&] { return writeTexts(work, road.stages(), out); });
    KpResult result = road.result();
    if (result.isOk() && !job.derived.empty())
        result << derived.publish();
    if (result.isOk())
        result << out.publish();
    if (result.isOk())
        result << printText(memoryLine(work.volume) + "\n");
    return result;
}
