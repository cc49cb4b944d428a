// Runs each operation with each of its calls of files and sockets failing once, and reports what fails in silence,
// writes half a file, crashes or hangs although its contract does not say so.

#include "../support/Child.h"
#include "Calls.h"
#include "Operation.h"

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>

#include <array>
#include <atomic>
#include <cstdio>
#include <exception>

namespace {

using namespace kplib::probe;

constexpr unsigned secondsPerOperation = 60;

std::atomic<int> warnings = 0;

void countLine(KpLogLevel, const KpString&)
{
    ++warnings;
}

void prepare(const Operation& operation)
{
    if (operation.prepare)
        operation.prepare();
}

std::uint64_t written(const Operation& operation)
{
    return operation.written ? operation.written() : 0;
}

/// What an operation does while nothing fails.
struct Clean {
    long calls;
    Outcome outcome;
    std::uint64_t before, after;  ///< what it has written

    explicit Clean(const Operation& operation)
    {
        operation.run();  // what is made on first use
        prepare(operation);
        before = written(operation);
        const FailingCall counting(-1, Fault::Input);
        outcome = operation.run();
        calls = FailingCall::seen();
        const Exempt exempt;
        after = written(operation);
    }
};

/// Whether the operation says that it failed, by its result, an exception or a line in the log.
bool isReported(const Operation& operation, long call, Fault fault, Outcome& outcome, Findings& findings)
{
    warnings = 0;
    try {
        const FailingCall failing(call, fault);
        outcome = operation.run();
    } catch (const std::exception& problem) {
        findings.fail(problem.what());
    }
    return !outcome || warnings > 0;
}

void attempt(const Operation& operation, long call, Fault fault, const Clean& clean, Findings& findings)
{
    Outcome outcome;
    prepare(operation);
    std::snprintf(findings.doing, sizeof findings.doing, "call %ld, %s", call, nameOf(fault));
    const bool reported = isReported(operation, call, fault, outcome, findings);
    if (!FailingCall::failed())
        return;
    std::snprintf(findings.doing, sizeof findings.doing, "call %ld, %s, %s", call, FailingCall::failed(),
                  nameOf(fault));
    ++findings.runs;
    const std::uint64_t left = written(operation);
    const bool isWhole = left == clean.after;
    if (reported)
        ++findings.reported;
    else if (outcome == clean.outcome && isWhole)
        ++findings.harmless;
    else if (++findings.silent; !operation.silence)
        findings.fail("fails in silence");
    if (!isWhole && left != clean.before && left != 0 && (++findings.partial, !operation.partial))
        findings.fail("leaves half a file");
}

void runAll(const Operation& operation, Findings& findings)
{
    getTheLogInstance().setLogLevel(KpLogOff);
    getTheLogInstance().setWriteCallback(countLine, KpLogWarning);
    prepare(operation);
    const Clean clean(operation);
    if (!clean.outcome)
        findings.fail("does not work");
    findings.allocations = clean.calls;
    for (long call = 0; call < clean.calls; ++call) {
        for (int fault = 0; fault < static_cast<int>(Fault::Count); ++fault)
            attempt(operation, call, static_cast<Fault>(fault), clean, findings);
    }
    prepare(operation);
    if (operation.run() != clean.outcome)
        findings.fail("leaves the library changed");
}

bool passes(const Operation& operation, Findings& findings)
{
    runInChild(findings, secondsPerOperation, [&] { runAll(operation, findings); });
    const bool isGood = findings.problem[0] == '\0';
    std::printf("%s %s: %ld calls, %ld runs, %ld reported, %ld harmless, %ld silent\n", isGood ? "ok  " : "FAIL",
                operation.name, findings.allocations, findings.runs, findings.reported, findings.harmless,
                findings.silent);
    if (!isGood)
        std::printf("     %s\n", findings.problem);
    if (findings.silent > 0 && operation.silence)
        std::printf("     %s is silent by contract: %s\n", operation.name, operation.silence);
    if (findings.partial > 0 && operation.partial)
        std::printf("     %s may leave a part by contract: %s\n", operation.name, operation.partial);
    return isGood;
}

}  // namespace

int main()
{
    Findings* const findings = sharedFindings();
    if (!findings)
        return 2;
    int passed = 0, failed = 0;
    for (const Operations& operations :
         std::array{fileOperations(), folderOperations(), logOperations(), peerOperations()}) {
        for (const Operation& operation : operations)
            ++(passes(operation, *findings) ? passed : failed);
    }
    std::printf("%d passed, %d failed\n", passed, failed);
    return failed > 0 ? 1 : 0;
}
