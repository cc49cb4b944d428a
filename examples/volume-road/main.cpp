// volume-road: reads any DICOM series of an archive and takes it all the way to pictures, measures and a page.

#include "commands/Abort.h"
#include "commands/Commands.h"
#include "commands/TerminalProgress.h"
#include "dicom/Pixels.h"

#include <kplib/foundation/KpException.h>
#include <kplib/log/KpLogFile.h>

#include <CLI/CLI.hpp>
#include <dcmtk/config/osconfig.h>
#include <dcmtk/oflog/oflog.h>

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <exception>
#include <initializer_list>
#include <iterator>
#include <stdexcept>
#include <string>

namespace {

constexpr int exitDifference = 1;
constexpr int exitBadInput = 2;
constexpr int usualTimeout = 60;

using Command = KpResult (*)(const Job&, KpProgressInterface&);

CLI::App& addCommand(CLI::App& app, const char* name, const char* purpose, const std::string& example)
{
    CLI::App& command = *app.add_subcommand(name, purpose);
    command.footer("Example:\n  volume-road " + example);
    return command;
}

void addSeries(CLI::App& command, Job& job, bool isRequired = true)
{
    command.add_option("SERIES", job.choice.folder, "folder with the images, in any order")->required(isRequired);
    command.add_option("--series", job.choice.uid, "series instance UID, where the folder holds several");
    command
        .add_option("--volume", job.choice.volume, "number of the volume, where the series holds several (see list)")
        ->check(CLI::Range(1, 1 << 20));
}

void addThreshold(CLI::App& command, Job& job)
{
    command
        .add_option("--threshold", job.threshold,
                    "value from which on voxels belong to the object; by Otsu's method, if not given")
        ->check([](const std::string& text) {
            return std::isfinite(std::strtod(text.c_str(), nullptr)) ? ""
                                                                     : "--threshold takes a number, not '" + text + "'";
        });
}

void addTimeout(CLI::App& command, Job& job)
{
    command.add_option("--timeout", job.timeout, "seconds that the peer may be silent; 0 waits for ever (default 60)")
        ->check(CLI::Range(0, 86400));
}

void addMakeSeries(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "make-series", "write a volume as a DICOM series",
                                   "make-series --nifti brain.nii.gz --volume 2 brain-series");
    static bool isPhantom = false;  // without a source file it is the phantom
    CLI::Option_group& source = *command.add_option_group("source");
    source.add_option("--nifti", job.source, "a NIfTI volume");
    source.add_flag("--phantom", isPhantom, "the built-in head phantom");
    source.require_option(1);
    command.add_option("--volume", job.sourceVolume, "number of the volume, where the file holds several");
    command.add_option("OUT", job.target, "folder to write the images into")->required();
}

void addRun(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "run", "read a series; write pictures, header, reports and a page",
                                   "run archive/patient7 out --volume 2 --derived out-half");
    addSeries(command, job, false);
    addThreshold(command, job);
    addTimeout(command, job);
    CLI::Option* const remote = command.add_option("--http", job.url, "URL of an exported volume, in place of SERIES");
    command.add_option("--derived", job.derived, "folder for the reduced volume as a DICOM series of its own")
        ->excludes(remote);
    command.add_option("OUT", job.target, "folder to write into");
}

void addMeasure(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "measure", "measure the largest region of a series",
                                   "measure archive/patient7 measured --threshold 300");
    addSeries(command, job);
    addThreshold(command, job);
    command.add_flag("--json", job.isJson, "write measures.json in place of measures.txt");
    command.add_option("OUT", job.target, "folder to write into")->required();
}

void addList(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "list", "print every series and volume below a folder", "list archive --json");
    command.add_option("FOLDER", job.choice.folder)->required();
    command.add_flag("--json", job.isJson, "as JSON");
}

void addExport(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "export", "write a series as one raw file, for a server to give out",
                                   "export archive/patient7 volume.raw --describe volume.json");
    addSeries(command, job);
    command.add_option("--describe", job.describe, "JSON file for the layout of the file and the place of each slice");
    command.add_option("FILE", job.target, "the file to write; - is standard output")->required();
}

void addSend(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "send", "reduce and segment a series, and send it to a peer",
                                   "send archive/patient7 127.0.0.1 4040 sent");
    addSeries(command, job);
    addThreshold(command, job);
    addTimeout(command, job);
    command.add_option("HOST", job.address, "name or address of the peer")->required();
    command.add_option("PORT", job.port, "its port")->required()->check(CLI::Range(1, 65535));
    command.add_option("OUT", job.target, "folder for the pictures of the volume that is sent");
}

void addServe(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "serve", "wait for a peer; write the pictures of the volume it sends",
                                   "serve 4040 received --listen 0.0.0.0");
    command.add_option("PORT", job.port, "port of this machine, 0 for any free one")
        ->required()
        ->check(CLI::Range(0, 65535));
    command.add_option("--listen", job.address, "address to listen at (default 127.0.0.1: this machine alone)");
    addTimeout(command, job);
    command.add_option("OUT", job.target, "folder to write into")->required();
}

void addHeader(CLI::App& app, Job& job)
{
    CLI::App& command = addCommand(app, "header", "print the header of one DICOM file as a tree",
                                   "header image.dcm --json\n  volume-road header old.dcm new.dcm --diff");
    command.add_option("FILE", job.source, "a DICOM file; - is standard input")->required();
    CLI::Option* const other = command.add_option("OTHER", job.other, "a second file to compare it with");
    CLI::Option* const diff =
        command.add_flag("--diff", job.isDiff, "print what differs from OTHER; exit 1 if something does");
    other->needs(diff);
    diff->needs(other);
    command.add_flag("--json", job.isJson, "as JSON, with VR, keyword and private creator of each tag");
}

int report(const KpResult& result)
{
    if (result.isOk())
        return 0;
    if (result.code() == KpResult::False)  // what differs is printed
        return exitDifference;
    std::fprintf(stderr, "volume-road: %s\n", result.text());
    return result.code() == KpResult::Interrupted ? exitCodeOfSignal() : exitBadInput;
}

/// A job reads a series or a URL; with a URL the one folder that is given is the output.
KpResult runJob(const Job& given, KpProgressInterface& progress)
{
    Job job = given;
    if (!job.url.empty() && job.target.empty())
        std::swap(job.choice.folder, job.target);
    if (job.target.empty() || job.choice.folder.empty() == job.url.empty())
        return KpResult(KpResult::InvalidArgument,
                        "run takes SERIES and OUT, or --http URL and OUT; see volume-road --help", nullptr);
    return run(job, progress);
}

const struct {
    const char* name;
    Command command;
} commands[] = {
    {"make-series", makeSeries},
    {"run", runJob},
    {"measure", measure},
    {"list", list},
    {"export", exportSeries},
    {"send", send},
    {"serve", [](const Job& job, KpProgressInterface&) { return serve(job); }},
    {"header", [](const Job& job, KpProgressInterface&) { return job.isDiff ? diffHeaders(job) : printHeader(job); }},
};

int start(const CLI::App& app, Job& job)
{
    watchSignals();
    registerDecoders();
    KpProgressInterface progress;
    TerminalProgress terminal;
    progress.setProgressGui(&terminal);
    for (const auto& [name, command] : commands) {
        if (!app.got_subcommand(name))
            continue;
        return report(command(job, progress));
    }
    return exitBadInput;
}

/// A first word that is no command: the library of the command line says only that one is missing.
bool isUnknownCommand(int argc, char** argv)
{
    return argc > 1 && argv[1][0] != '-' &&
           std::none_of(std::begin(commands), std::end(commands),
                        [&](const auto& command) { return std::string(command.name) == argv[1]; });
}

int parseAndStart(int argc, char** argv)
{
    Job job;
    job.timeout = usualTimeout;
    CLI::App app("Reads DICOM series and takes them down the road: header tree, volume, pictures, measures, page.",
                 "volume-road");
    app.require_subcommand(1);
    app.set_version_flag("--version", "volume-road (kplib) " KPLIB_VERSION, "Print the version and exit");
    app.set_help_all_flag("--help-all", "Print the help of all commands and exit");
    app.footer(
        "volume-road COMMAND --help explains a command and gives an example.\n\n"
        "Exit codes: 0 fine, 1 headers that differ, 2 an error, 128 and the number of a signal that ended it.\n\n"
        "Examples:\n"
        "  $ volume-road list archive\n"
        "  $ volume-road run archive/patient7 out");
    for (auto* const add : {addMakeSeries, addRun, addMeasure, addList, addExport, addSend, addServe, addHeader})
        add(app, job);
    if (isUnknownCommand(argc, argv)) {
        std::fprintf(stderr, "volume-road: there is no command '%s'; see volume-road --help\n", argv[1]);
        return exitBadInput;
    }
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& e) {
        if (e.get_exit_code() == 0)
            return app.exit(e);
        std::fprintf(stderr, "volume-road: %s; see volume-road --help\n", e.what());
        return exitBadInput;
    }
    if (app.got_subcommand("serve") && job.address.empty())
        job.address = "127.0.0.1";
    return start(app, job);
}

}  // namespace

int main(int argc, char** argv)
{
    // All messages for the user are the program's own.
    OFLog::configure(OFLogger::OFF_LOG_LEVEL);
    getTheLogInstance().setLogLevel(KpLogOff);
    try {
        return parseAndStart(argc, argv);
    } catch (KpException& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    } catch (const std::exception& e) {
        std::fprintf(stderr, "volume-road: %s\n", e.what());
    }
    return exitBadInput;
}
