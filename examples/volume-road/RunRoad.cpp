#include "RunRoad.h"

#include "DicomSeries.h"
#include "JobLog.h"
#include "Oblique.h"
#include "Report.h"
#include "Segment.h"

#include <kplib/log/KpLogFile.h>
#include <kplib/rawdata/KpRawData.h>
#include <kplib/system/KpWatch.h>
#include <kplib/threads/ProgressScope.h>

#include <algorithm>
#include <cstdio>

namespace {

/// The volume with each axis shorter by a whole factor; an axis that is shorter than the factor becomes one voxel.
Volume shrunk(const Volume& volume, std::array<int, 3>& factors)
{
    Volume small;
    small.type = volume.type;
    small.axes = volume.axes;
    small.origin = volume.origin;
    small.isPlaced = volume.isPlaced;
    small.slope = volume.slope;
    small.intercept = volume.intercept;
    for (size_t i = 0; i < 3; ++i) {
        factors[i] = static_cast<int>(std::min<long>(factors[i], volume.dims[i]));
        small.dims[i] = volume.dims[i] / factors[i];
        small.spacing[i] = volume.spacing[i] * factors[i];
        for (size_t p = 0; p < 3; ++p)  // to the middle of the first block
            small.origin[p] += (factors[i] - 1) / 2.0 * volume.spacing[i] * volume.axes[i][p];
    }
    small.allocate();
    return small;
}

Volume reducedByMean(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSample3D(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                            static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0], f[1], f[2], &progress);
    return small;
}

Volume reducedByMaximum(Volume& volume, std::array<int, 3> f, KpProgressInterface& progress)
{
    Volume small = shrunk(volume, f);
    const auto [x, y, z] = volume.dims;
    KpRawData::downSampleMaxFilterComponents3DN(small.bytes.data(), volume.voxels(), static_cast<unsigned long>(x),
                                                static_cast<unsigned long>(y), static_cast<unsigned long>(z), f[0],
                                                f[1], f[2], 1, &progress);
    return small;
}

/// The window of the header, or else one that suits the values.
Window chooseWindow(const HxParamBundle& root, Volume& small)
{
    Window window;
    window.isInverted = KpString(root.findTag("G0028-0004", "")) == "MONOCHROME1";
    KpDArray<float> center, width;
    root.findTag("G0028-1050", center);
    root.findTag("G0028-1051", width);
    if (center.size() > 0 && width.size() > 0 && width[0] >= 1) {
        window.center = static_cast<double>(center[0]);
        window.width = static_cast<double>(width[0]);
        window.origin = "from the header";
        return window;
    }
    const bool isInverted = window.isInverted;
    window = windowOf(small);
    window.isInverted = isInverted;
    return window;
}

/// Walks the stages of the road; each is one step of the outer progress and one line of the report.
class Road {
public:
    explicit Road(KpProgressInterface& progress) : progress_(progress), watch_(true) {}

    /// Runs a stage that opens a progress of its own; nothing once one has failed or the job is cancelled.
    template <typename Work>
    void nested(const char* name, Work work)
    {
        if (begins(name)) {
            result_ << work();
            ends(name);
        }
    }

    /// Runs a stage without one.
    template <typename Work>
    void plain(const char* name, Work work)
    {
        if (begins(name)) {
            result_ << work();
            progress_.nextStep();
            ends(name);
        }
    }

    KpResult result() const
    {
        if (progress_.isCanceled())
            return KpResult(KpResult::Interrupted, "cancelled, nothing was written", nullptr);
        return result_;
    }
    const std::vector<Stage>& stages() const { return stages_; }

private:
    bool begins(const char* name)
    {
        if (result_.isBad() || progress_.isCanceled())
            return false;
        progress_.setProgressText(name);
        watch_.start();
        return true;
    }
    void ends(const char* name)
    {
        stages_.push_back({name, watch_.stop2()});
        getTheLogInstance().printf("%s: %.3f s", name, stages_.back().seconds);
    }

    KpProgressInterface& progress_;
    KpWatch watch_;
    KpResult result_;
    std::vector<Stage> stages_;
};

}  // namespace

KpResult runRoad(const char* folder, const std::string& uid, std::optional<double> threshold, const std::string& target,
                 KpProgressInterface& progress)
{
    OutputFolder out;
    if (KpResult opened = out.open(target); opened.isBad())
        return opened;
    const ProgressScope scope(&progress);
    const JobLog log(out.working());
    progress.startWorking(9, "");
    Road road(progress);
    Series series;
    HxParamBundle root("Volume");
    Volume volume, mean, maximum, shown;
    Window window;
    road.nested("look for images", [&] { return scanSeries(folder, uid, progress, series); });
    for (const std::string& warning : series.warnings) {
        std::fprintf(stderr, "volume-road: warning: %s\n", warning.c_str());
        getTheLogInstance().warn(nullptr, warning.c_str());
    }
    road.nested("read images", [&] { return readSeries(series, progress, volume, root); });
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
        return segment(volume, *space, threshold, progress, region);
    });
    road.plain("draw planes", [&] {
        window = chooseWindow(root, mean);
        display(volume, window, shown);
        return writePlanes(shown, region.outline, out);
    });
    road.plain("cut obliquely", [&] { return writeOblique(shown, *space, region.outline, out); });
    road.plain("draw overviews", [&] {
        display(mean, window, shown);
        KpResult written = writeOverview(shown, out, "overview-mean.png");
        display(maximum, window, shown);
        written << writeOverview(shown, out, "overview-maximum.png");
        return written;
    });
    road.plain("write texts", [&] {
        KpResult written = writeHeader(root, out);
        written << writeReport(root, series, volume, window, region, road.stages(), out);
        return written;
    });
    KpResult result = road.result();
    if (result.isOk())
        result << out.publish();
    return result;
}
