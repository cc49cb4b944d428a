// volume-road: makes a DICOM series of a volume, and takes a series all the way to pictures.

#include "DicomTree.h"
#include "DicomWriter.h"
#include "NiftiVolume.h"
#include "OutputFolder.h"
#include "Phantom.h"
#include "Pictures.h"
#include "RunRoad.h"
#include "TerminalProgress.h"

#include <kplib/foundation/KpException.h>

#include <CLI/CLI.hpp>
#include <dcmtk/config/osconfig.h>
#include <dcmtk/oflog/oflog.h>

#include <cstdio>
#include <optional>
#include <string>

namespace {

constexpr int exitBadInput = 2, exitInterrupted = 130;

KpResult makeSeries(const std::string& nifti, const std::string& target, KpProgressInterface& progress)
{
    Volume volume;
    if (nifti.empty())
        volume = makePhantom();
    else if (KpResult read = readNifti(nifti.c_str(), volume); read.isBad())
        return read;
    OutputFolder out;
    if (KpResult opened = out.open(target); opened.isBad())
        return opened;
    const Window window = windowOf(volume);
    const SeriesText text{"Example study", nifti.empty() ? "Head phantom" : "Head", nifti.empty() ? "phantom" : "NIfTI",
                          window.center, window.width};
    KpResult result = writeSeries(volume, text, out.working().c_str(), progress);
    if (progress.isCanceled())
        return KpResult(KpResult::Interrupted, "cancelled, nothing was written", nullptr);
    if (result.isOk())
        result << out.publish();
    return result;
}

KpResult printHeader(const std::string& path)
{
    HxParamBundle root("Header");
    if (KpResult read = readHeader(path.c_str(), root); read.isBad())
        return read;
    KpString text;
    root.print(text, 0, nullptr);
    std::fputs(text, stdout);
    return std::fflush(stdout) == 0 ? KpResult() : badInput("can't write to standard output");
}

int report(const KpResult& result)
{
    if (result.isOk())
        return 0;
    std::fprintf(stderr, "volume-road: %s\n", result.text());
    return result.code() == KpResult::Interrupted ? exitInterrupted : exitBadInput;
}

int run(int argc, char** argv)
{
    std::string nifti, series, target, uid, file;
    bool isPhantom = false;
    std::optional<double> threshold;
    CLI::App app("Takes a volume down the road: DICOM files, header tree, voxels, reduced volumes, pictures.",
                 "volume-road");
    app.require_subcommand(1);

    CLI::App& make = *app.add_subcommand("make-series", "write a volume as a DICOM series");
    CLI::Option_group& source = *make.add_option_group("source");
    source.add_option("--nifti", nifti, "a NIfTI volume");
    source.add_flag("--phantom", isPhantom, "the built-in head phantom");
    source.require_option(1);
    make.add_option("OUT", target, "folder to write the images into")->required();

    CLI::App& road = *app.add_subcommand("run", "read a series; write pictures, header and report");
    road.add_option("SERIES", series, "folder with the images, in any order")->required();
    road.add_option("OUT", target, "folder to write into")->required();
    road.add_option("--series", uid, "series instance UID, where the folder holds several");
    road.add_option("--threshold", threshold,
                    "value from which on voxels belong to the object; by Otsu's method, if not given");

    CLI::App& header = *app.add_subcommand("header", "print the header of one DICOM file as a tree");
    header.add_option("FILE", file)->required();

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        if (e.get_exit_code() == 0)
            return app.exit(e);
        std::fprintf(stderr, "volume-road: %s; see volume-road --help\n", e.what());
        return exitBadInput;
    }
    if (header)
        return report(printHeader(file));
    KpProgressInterface progress;
    TerminalProgress terminal;
    progress.setProgressGui(&terminal);
    return report(make ? makeSeries(nifti, target, progress)
                       : runRoad(series.c_str(), uid, threshold, target, progress));
}

}  // namespace

int main(int argc, char** argv)
{
    OFLog::configure(OFLogger::OFF_LOG_LEVEL);  // what concerns the user is told in our own words
    try {
        return run(argc, argv);
    } catch (KpException& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    }
    return 1;
}
