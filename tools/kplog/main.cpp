// kplog: prints lines of log files, filtered, over the chunks of a log, and as they are written.

#include "Chunks.h"
#include "Filter.h"
#include "Output.h"

#include <support/Program.h>

#include <CLI/CLI.hpp>

#include <chrono>
#include <cstdio>
#include <fstream>
#include <iostream>
#include <stdexcept>
#include <string>
#include <thread>
#include <vector>

namespace {

constexpr auto pollInterval = std::chrono::milliseconds(100);

struct Job {
    std::vector<std::string> files;
    Filter filter;
    std::string colour = "auto";
    Style style;
    bool withEarlier = false;
    bool follows = false;
    bool isCheck = false;
};

// Prints the wanted lines of one file after the other.
class Printer {
public:
    explicit Printer(const Job& job) : job_(job) {}

    /// Prints all lines of the stream; a last line without a newline only if `isComplete`.
    void read(std::istream& in, EntryReader& reader, bool isComplete)
    {
        for (std::string part; std::getline(in, part);) {
            line_ += part;
            if (in.eof())  // without a newline
                break;
            printLine(reader);
        }
        if (isComplete && !line_.empty())
            printLine(reader);
        flush();
    }

    bool hasPrinted() const { return hasPrinted_; }

private:
    void printLine(EntryReader& reader)
    {
        const Entry& entry = reader.read(line_);
        if (entry.hasHead && entry.date.empty() && job_.filter.hasDates())
            warnOfDates(entry);
        if (job_.filter.takes(entry)) {
            output_ += outputOf(entry, line_, job_.style);
            hasPrinted_ = true;
        }
        line_.clear();
        if (output_.size() > 65536)
            flush();
    }
    void flush()
    {
        print(output_);
        output_.clear();
    }
    void warnOfDates(const Entry& entry)
    {
        if (!hasWarned_)
            std::fprintf(stderr, "kplog: the lines of '%s' have no date; give a time alone\n", entry.file.c_str());
        hasWarned_ = true;
    }

    const Job& job_;
    std::string line_;
    std::string output_;
    bool hasPrinted_ = false;
    bool hasWarned_ = false;
};

// Prints what is appended to the file until another one continues it; returns that one.
std::string follow(const std::string& file, Printer& printer)
{
    std::ifstream in(file, std::ios::binary);
    EntryReader reader(file);
    std::string next;
    for (;;) {
        printer.read(in, reader, !next.empty());
        if (!next.empty())
            return next;
        std::this_thread::sleep_for(pollInterval);
        next = nextChunk(file);  // nothing is appended to `file` once there is one
        in.clear();
    }
}

void readAll(const std::string& file, Printer& printer)
{
    EntryReader reader(file);
    if (file == "-") {
        printer.read(std::cin, reader, true);
        return;
    }
    std::ifstream in(file, std::ios::binary);
    printer.read(in, reader, true);
}

Exit run(Job& job)
{
    job.style.hasColours = wantsColours(job.colour);
    const std::vector<std::string> files = orderedChunks(job.files, job.withEarlier);
    if (job.follows && files.back() == "-")
        throw Failure("--follow takes files, not standard input");
    Printer printer(job);
    for (const std::string& file : files) {
        if (!job.follows || file != files.back())
            readAll(file, printer);
    }
    for (std::string file = files.back(); job.follows;)
        file = follow(file, printer);
    return job.isCheck && printer.hasPrinted() ? ExitFinding : ExitFine;
}

// The letter of a level or its name, in any case.
KpLogLevel levelOf(const std::string& text)
{
    const char* const names[] = {"debug", "info", "warning", "error", "critical"};
    for (int level = KpLogDebug; level <= KpLogCritical; ++level) {
        const std::string name = names[level];
        if (CLI::detail::to_lower(text) == name || CLI::detail::to_lower(text) == name.substr(0, 1))
            return static_cast<KpLogLevel>(level);
    }
    throw CLI::ValidationError("--level", "'" + text + "' is no level; give D, I, W, E or C");
}

void addOptions(CLI::App& app, Job& job)
{
    app.add_option("FILE", job.files, "Log files; - is standard input")->required();
    app.add_option_function<std::string>(
        "-l,--level", [&job](const std::string& text) { job.filter.level = levelOf(text); },
        "Least level: D(ebug), I(nfo), W(arning), E(rror) or C(ritical)");
    app.add_option("-m,--module", job.filter.modules, "Only lines of this module; may be given several times")
        ->allow_extra_args(false);
    app.add_option("--since", job.filter.since, "First time: 14:03, 2017-03-01 or '2017-03-01 14:03:59'")
        ->check(problemOfBound);
    app.add_option("--until", job.filter.until, "Last time; 14:03 includes 14:03:59.999")->check(problemOfBound);
    app.add_flag("--chunks", job.withEarlier, "Also the earlier files that the given ones continue");
    app.add_flag("-f,--follow", job.follows, "Print lines as they are written, also those of files that follow");
    app.add_flag("--check", job.isCheck, "Exit with 1 if a line is printed");
    app.add_option("--color", job.colour, "Colours: auto, always or never")
        ->check(CLI::IsMember({"auto", "always", "never"}));
    app.add_flag("--json", job.style.isJson, "Print one JSON object a line");
}

}  // namespace

int main(int argc, char** argv)
{
    Job job;
    CLI::App app("Prints lines of log files: by level, module and time, over the files of a log, as they are written.",
                 "kplog");
    addOptions(app, job);
    app.footer("Files that begin with \"This file continues\" follow the file that they name. Lines without a head\n"
               "belong to the message above them.\n\n"
               "Exit codes: 0 fine, 1 a line was printed with --check, 2 an error.\n\n"
               "Examples:\n"
               "  $ kplog --level W --since 14:03 --until 14:10 server.log\n"
               "  $ kplog --chunks --follow --module Net newest.log\n"
               "  $ kplog --check --level E *.log\n"
               "  $ kplog --json - < server.log");
    return runTool(app, argc, argv, [&] { return run(job); });
}
