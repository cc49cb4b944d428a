// volume-road: makes a DICOM series of a volume, and takes a series all the way to pictures.

#include "DicomTree.h"
#include "DicomWriter.h"
#include "Measure.h"
#include "NiftiVolume.h"
#include "OutputFolder.h"
#include "PeerRoad.h"
#include "Phantom.h"
#include "Pictures.h"
#include "RemoteVolume.h"
#include "RunRoad.h"
#include "TerminalProgress.h"

#include <kplib/foundation/KpException.h>
#include <kplib/log/KpLogFile.h>

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

/// A job reads a series or a URL; with a URL the one folder that is given is the output.
KpResult checkSource(Job& job, std::string& target)
{
    if (!job.url.empty() && target.empty())
        std::swap(job.folder, target);
    if (target.empty() || job.folder.empty() == job.url.empty())
        return badInput("run takes SERIES and OUT, or --http URL and OUT; see volume-road --help");
    return KpResult();
}

int run(int argc, char** argv)
{
    std::string nifti, target, file, host;
    int port = 0;
    bool isPhantom = false;
    Job job;
    CLI::App app("Takes a volume down the road: DICOM files, header tree, voxels, reduced volumes, pictures.",
                 "volume-road");
    app.require_subcommand(1);

    CLI::App& make = *app.add_subcommand("make-series", "write a volume as a DICOM series");
    CLI::Option_group& source = *make.add_option_group("source");
    source.add_option("--nifti", nifti, "a NIfTI volume");
    source.add_flag("--phantom", isPhantom, "the built-in head phantom");
    source.require_option(1);
    make.add_option("OUT", target, "folder to write the images into")->required();

    const auto addSeries = [&job](CLI::App& command) {
        command.add_option("SERIES", job.folder, "folder with the images, in any order")->required();
        command.add_option("--series", job.uid, "series instance UID, where the folder holds several");
    };
    const auto addThreshold = [&job](CLI::App& command) {
        command.add_option("--threshold", job.threshold,
                           "value from which on voxels belong to the object; by Otsu's method, if not given");
    };

    CLI::App& road = *app.add_subcommand("run", "read a series; write pictures, header and report");
    addSeries(road);
    addThreshold(road);
    CLI::Option* const remote =
        road.add_option("--http", job.url, "URL of an exported volume on a server, in place of SERIES");
    road.get_option("SERIES")->required(false);
    road.add_option("--derived", job.derived, "folder for the reduced volume as a DICOM series of its own")
        ->excludes(remote);
    road.add_option("OUT", target, "folder to write into");

    CLI::App& measuring = *app.add_subcommand("measure", "measure the largest region of a series");
    addSeries(measuring);
    addThreshold(measuring);
    measuring.add_option("OUT", target, "folder to write into")->required();

    CLI::App& exporting = *app.add_subcommand("export", "write a series as one raw file, for a server to give out");
    addSeries(exporting);
    exporting.add_option("FILE", file, "the file to write")->required();

    CLI::App& sending = *app.add_subcommand("send", "reduce and segment a series, and send it to a peer");
    addSeries(sending);
    addThreshold(sending);
    sending.add_option("HOST", host, "where the peer is")->required();
    sending.add_option("PORT", port, "where it waits")->required()->check(CLI::Range(1, 65535));
    sending.add_option("OUT", target, "folder for the pictures of what is sent");

    CLI::App& serving = *app.add_subcommand("serve", "wait for a peer; write the pictures of what it sends");
    serving.add_option("PORT", port, "port of this machine, 0 for any free one")
        ->required()
        ->check(CLI::Range(0, 65535));
    serving.add_option("OUT", target, "folder to write into")->required();

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
    if (road) {
        if (KpResult checked = checkSource(job, target); checked.isBad())
            return report(checked);
    }
    if (header)
        return report(printHeader(file));
    KpProgressInterface progress;
    TerminalProgress terminal;
    progress.setProgressGui(&terminal);
    if (make)
        return report(makeSeries(nifti, target, progress));
    if (serving)
        return report(serveRoad(port, target));
    if (sending)
        return report(sendRoad(job, host, port, target, progress));
    if (measuring)
        return report(measureRoad(job, target, progress));
    if (exporting)
        return report(exportVolume(job.folder, job.uid, file, progress));
    return report(runRoad(job, target, progress));
}

}  // namespace

int main(int argc, char** argv)
{
    // What concerns the user is told in our own words.
    OFLog::configure(OFLogger::OFF_LOG_LEVEL);
    getTheLogInstance().setLogLevel(KpLogOff);
    try {
        return run(argc, argv);
    } catch (KpException& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    }
    return 1;
}
