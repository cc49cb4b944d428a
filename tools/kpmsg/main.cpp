// kpmsg: shows what messages between peers hold, compares them, and records them on their way.

#include "Compare.h"
#include "Hex.h"
#include "Listing.h"
#include "Tap.h"

#include <support/Program.h>

#include <CLI/CLI.hpp>

#include <cstdio>
#include <stdexcept>
#include <string>

namespace {

struct Job {
    std::string types;
    std::string a, b;
    TapJob tap;
    bool isJson = false;
};

CLI::App& addCommand(CLI::App& app, Job& job, const char* name, const char* purpose, const std::string& examples)
{
    CLI::App& command = *app.add_subcommand(name, purpose);
    command.add_flag("--json", job.isJson, "Print JSON");
    command.footer("Examples:\n" + examples);
    return command;
}

void addTypes(CLI::App& command, Job& job, const std::string& names)
{
    command.add_option("--as", job.types,
                       "Types of the values in their order, with blanks or commas between them: " + names);
}

void addCommands(CLI::App& app, Job& job)
{
    CLI::App& dump = addCommand(app, job, "dump", "Print the values of a message: offset, size, type, value",
                                "  $ kpmsg dump request.bin\n"
                                "  $ kpmsg dump request.bin --as 'int KpString KpDArray<KpVec3f> TmDataAccess'\n"
                                "  $ tail -c +9 0001-to-peer.bin | kpmsg dump - --as 'int float' --json");
    dump.add_option("FILE", job.a, "Bytes of a message; - is standard input")->required();
    addTypes(dump, job, valueTypeNames());

    CLI::App& diff = addCommand(app, job, "diff", "Print what differs between two messages; exit 1 if something does",
                                "  $ kpmsg diff old.bin new.bin --as 'int KpString KpMat4f'");
    diff.add_option("A", job.a, "Bytes of a message; - is standard input")->required();
    diff.add_option("B", job.b, "Bytes of the other")->required();
    addTypes(diff, job, "see dump");

    CLI::App& tap = addCommand(app, job, "tap", "Pass on what two peers send each other, and write it to files",
                               "  $ kpmsg tap 4041 server:4040 captured     # the client then connects to port 4041\n"
                               "  $ kpmsg tap 0.0.0.0:4041 server:4040 captured --connections 1");
    tap.add_option("LISTEN", job.tap.listen, "PORT or ADDRESS:PORT to listen at; port 0 is any free one")->required();
    tap.add_option("PEER", job.tap.peer, "HOST:PORT of the peer")->required();
    tap.add_option("DIR", job.tap.folder, "Folder for the files NNNN-to-peer.bin and NNNN-from-peer.bin")->required();
    tap.add_option("--connections", job.tap.connections, "End after so many connections")->check(CLI::PositiveNumber);
}

Exit dump(const Job& job)
{
    const auto types = valueTypes(job.types);
    const std::string bytes = readBytes(job.a);
    const Reading reading = readValues(bytes, types);
    print(job.isJson ? oneLine(listingAsJson(bytes, reading)) + "\n" : listing(bytes, reading));
    if (reading.problem.empty())
        return ExitFine;
    std::fprintf(stderr, "kpmsg: '%s': %s\n", job.a.c_str(), reading.problem.c_str());
    return ExitFinding;
}

Exit diff(const Job& job)
{
    const auto types = valueTypes(job.types);
    const Differences differences = compareMessages(readBytes(job.a), readBytes(job.b), types);
    const Json json{{"equal", differences.none()}, {"differences", differences.json}};
    print(job.isJson ? oneLine(json) + "\n" : differences.text);
    return differences.none() ? ExitFine : ExitFinding;
}

}  // namespace

int main(int argc, char** argv)
{
    Job job;
    CLI::App app("Shows what messages between peers hold, compares them, and records them on their way.", "kpmsg");
    app.require_subcommand(1);
    app.footer("Exit codes: 0 fine, 1 a difference or a message that ends too early, 2 an error.\n\n"
               "Examples:\n"
               "  $ kpmsg dump request.bin --as 'int KpString'\n"
               "  $ kpmsg diff old.bin new.bin\n"
               "  $ kpmsg tap 4041 server:4040 captured");
    addCommands(app, job);
    return runTool(app, argc, argv, [&] {
        if (app.got_subcommand("dump"))
            return dump(job);
        if (app.got_subcommand("diff"))
            return diff(job);
        job.tap.isJson = job.isJson;
        return tap(job.tap) ? ExitFine : ExitError;
    });
}
