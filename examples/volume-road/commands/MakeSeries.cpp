#include "../dicom/DicomWriter.h"
#include "../volume/NiftiVolume.h"
#include "../volume/Phantom.h"
#include "Commands.h"
#include "Load.h"
#include "OutputFolder.h"

#include <string>
#include <vector>

KpResult makeSeries(const Job& job, KpProgressInterface& progress)
{
    Volume volume;
    if (job.source.empty()) {
        volume = makePhantom();
    } else {
        std::vector<std::string> warnings;
        if (KpResult read = readNifti(job.source.c_str(), job.sourceVolume, volume, warnings); read.isBad())
            return read;
        printWarnings(warnings);
    }
    OutputFolder out;
    if (KpResult opened = out.open(job.target); opened.isBad())
        return opened;
    const Window window = windowOf(Windows(), volume);
    const bool isPhantom = job.source.empty();
    const SeriesText text{"Example study", isPhantom ? "Head phantom" : "Head", isPhantom ? "phantom" : "NIfTI",
                          window.center, window.width};
    KpResult result = writeSeries(volume, text, out.working().c_str(), progress);
    if (progress.isCanceled())
        return KpResult(KpResult::Interrupted, "cancelled, nothing was written", nullptr);
    if (result.isOk())
        result << out.publish();
    return result;
}
