// Runs each operation with each of its allocations failing once, from there on, and at random, and reports what
// crashes, leaks, hangs, changes the library for good, or fails in silence although its contract does not say so.

#include "../support/Child.h"
#include "FailingHeap.h"
#include "Operation.h"

#include <kplib/foundation/KpMemoryException.h>
#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLastError.h>
#include <kplib/log/KpLogFile.h>
#include <kplib/log/KpResult.h>

#include <array>
#include <atomic>
#include <cstdio>
#include <cstring>
#include <new>
#include <sanitizer/lsan_interface.h>

// A stack holds old addresses, at random: what only a stack refers to is a leak here.
extern "C" const char* __lsan_default_options();
const char* __lsan_default_options()
{
    return "use_stacks=0:use_registers=0";
}

namespace {

using namespace kplib::probe;

constexpr unsigned secondsPerOperation = 60;
constexpr std::uint32_t randomRuns = 20;

std::atomic<int> warnings = 0;

void countLine(KpLogLevel, const KpString&)
{
    ++warnings;
}

/// One run under a plan, and one without failures after it, which has to give what it gave before.
void attempt(const Operation& operation, const FailurePlan& plan, const Outcome& expected, Findings& report)
{
    warnings = 0;
    Outcome outcome;
    try {
        const FailingHeap heap(plan);
        outcome = operation.run();
    } catch (const KpMemoryException&) {
        outcome.reset();
    } catch (const std::bad_alloc&) {
        outcome.reset();
    } catch (...) {
        report.fail("throws what is no report of exhausted memory");
    }
    Tm::lastError(false);
    if (FailingHeap::failed() == 0)
        return;
    ++report.runs;
    if (!outcome || warnings > 0)
        ++report.reported;
    else if (outcome == expected)
        ++report.harmless;
    else if (++report.silent; !operation.silence)
        report.fail("fails in silence");
    if (operation.run() != expected)
        report.fail("leaves the library changed");
}

/// Everything, in a process of its own.
void runAll(const Operation& operation, Findings& report)
{
    std::snprintf(report.doing, sizeof report.doing, "without failures");
    getTheLogInstance().setLogLevel(KpLogOff);
    getTheLogInstance().setWriteCallback(countLine, KpLogWarning);
    operation.run();  // what is made on first use
    const Outcome expected = operation.run();
    {
        const FailingHeap heap({});
        if (operation.run() != expected)
            report.fail("gives another result each time");
        report.allocations = FailingHeap::seen();
    }
    if (!expected)
        report.fail("does not work");
    for (long i = 0; i < report.allocations; ++i) {
        for (const bool once : {true, false}) {
            std::snprintf(report.doing, sizeof report.doing, "allocation %ld%s", i, once ? "" : " and all after it");
            attempt(operation, {i, once}, expected, report);
        }
    }
    for (std::uint32_t seed = 1; seed <= randomRuns; ++seed) {
        std::snprintf(report.doing, sizeof report.doing, "at random, seed %u", seed);
        attempt(operation, {-1, false, seed}, expected, report);
    }
    std::snprintf(report.doing, sizeof report.doing, "see above");
    if (__lsan_do_recoverable_leak_check() != 0)
        report.fail("leaks");
}

bool passes(const char* folder, const Operation& operation, Findings& report)
{
    runInChild(report, secondsPerOperation, [&] { runAll(operation, report); });
    const bool isGood = report.problem[0] == '\0';
    std::printf("%s %s, %s: %ld allocations, %ld runs, %ld reported, %ld harmless, %ld silent\n",
                isGood ? "ok  " : "FAIL", folder, operation.name, report.allocations, report.runs, report.reported,
                report.harmless, report.silent);
    if (!isGood)
        std::printf("     %s\n", report.problem);
    if (report.silent > 0 && operation.silence)
        std::printf("     %s is silent by contract: %s\n", operation.name, operation.silence);
    return isGood;
}

struct Folder {
    const char* name;
    Operations operations;
};

}  // namespace

/// With an argument only the folder of that name.
int main(int argc, char** argv)
{
    const std::array folders{
        Folder{"foundation", foundationOperations()},
        Folder{"log", logOperations()},
        Folder{"param", paramOperations()},
        Folder{"geometry", geometryOperations()},
        Folder{"system", systemOperations()},
        Folder{"threads", threadsOperations()},
        Folder{"rawdata", rawdataOperations()},
        Folder{"volume", volumeOperations()},
        Folder{"numerics", numericsOperations()},
        Folder{"imaging", imagingOperations()},
        Folder{"net", netOperations()},
    };
    Findings* const report = sharedFindings();
    if (!report)
        return 2;
    int passed = 0, failed = 0;
    for (const Folder& folder : folders) {
        if (argc > 1 && std::strcmp(argv[1], folder.name) != 0)
            continue;
        for (const Operation& operation : folder.operations)
            ++(passes(folder.name, operation, *report) ? passed : failed);
    }
    std::printf("%d passed, %d failed\n", passed, failed);
    return failed > 0 ? 1 : passed > 0 ? 0 : 2;
}
