#include "Scan.h"

#include "DicomTree.h"

#include <kplib/threads/ProgressScope.h>

#include <dcmtk/config/osconfig.h>
#include <dcmtk/dcmdata/dctk.h>

#include <algorithm>
#include <filesystem>
#include <iterator>
#include <map>
#include <system_error>
#include <tuple>
#include <utility>

namespace fs = std::filesystem;

namespace {

KpResult listFiles(const std::string& folder, std::vector<std::string>& paths)
{
    std::error_code error;
    fs::recursive_directory_iterator entry(folder, error), end;
    while (!error && entry != end) {
        std::error_code unknown;  // a link that leads nowhere is no file
        if (entry->is_regular_file(unknown))
            paths.push_back(entry->path().string());
        entry.increment(error);
    }
    if (error)
        return badInput("can't read the folder '%s': %s", folder.c_str(), error.message().c_str());
    std::sort(paths.begin(), paths.end());
    return KpResult();
}

/// Takes the images of a file, or counts or names it as what else it is.
void takeFile(const std::string& path, std::vector<Image>& images, Scan& scan)
{
    std::error_code error;
    if (fs::file_size(path, error) == 0 && !error) {
        scan.warnings.push_back("'" + path + "' is empty and left out");
        return;
    }
    DcmFileFormat file;
    const OFCondition status = file.loadFile(path.c_str(), EXS_Unknown, EGL_noChange, 4096);
    if (status.good() && file.getDataset()->tagExists(DCM_PixelData)) {
        std::vector<Image> found = describe(path, file);
        std::move(found.begin(), found.end(), std::back_inserter(images));
    } else if (status.good() && (file.getDataset()->tagExists(DCM_FloatPixelData) ||
                                 file.getDataset()->tagExists(DCM_DoubleFloatPixelData))) {
        scan.warnings.push_back("'" + path + "' has floating-point pixels, which are not supported; it is left out");
    } else if (status.good() && file.getDataset()->card() > 0 && hasDicomMark(path.c_str())) {
        ++scan.otherObjects;
    } else if (hasDicomMark(path.c_str())) {
        scan.warnings.push_back("'" + path + "' is cut off or damaged and left out: " + status.text());
    } else if (!canRead(path.c_str())) {
        scan.warnings.push_back("'" + path + "' cannot be opened and is left out");
    } else {
        ++scan.otherFiles;
    }
}

/// Leaves one of several copies of an instance. Instances that have the same UID and differ in place are kept: some
/// tools write one UID into all files.
void dropCopies(std::vector<Image>& images, Scan& scan)
{
    std::map<std::tuple<std::string, unsigned long, int>, size_t> seen;
    std::vector<Image> kept;
    std::string named;
    for (Image& image : images) {
        const auto [first, isNew] = seen.emplace(std::tuple(image.instanceUid, image.frame, image.tile), kept.size());
        const Image* const twin = isNew || image.instanceUid.empty() ? nullptr : &kept[first->second];
        if (!twin || twin->number != image.number || !(twin->position == image.position) || twin->path == image.path) {
            kept.push_back(std::move(image));
        } else if (named != image.path) {
            named = image.path;
            scan.warnings.push_back("'" + image.path + "' is the same instance as '" + twin->path + "' and left out");
        }
    }
    images = std::move(kept);
}

}  // namespace

KpResult scanFolder(const std::string& folder, KpProgressInterface& progress, Scan& scan)
{
    std::vector<std::string> paths;
    if (KpResult listed = listFiles(folder, paths); listed.isBad())
        return listed;
    std::vector<Image> images;
    const ProgressScope scope(&progress);
    progress.startWorking(static_cast<int>(paths.size()), "");
    for (const std::string& path : paths) {
        if (progress.isCanceled())
            return KpResult();
        takeFile(path, images, scan);
        progress.nextStep();
    }
    dropCopies(images, scan);
    std::map<std::string, std::vector<Image>> byUid;
    for (Image& image : images)
        byUid[image.seriesUid].push_back(std::move(image));
    for (auto& [uid, found] : byUid) {
        SeriesEntry entry{uid, found.front().seriesDescription, found.front().modality, found.size(), {}};
        entry.volumes = splitIntoVolumes(std::move(found));
        scan.series.push_back(std::move(entry));
    }
    return KpResult();
}
