#pragma once

#include <CLI/App.hpp>

#include <functional>
#include <stdexcept>
#include <string>

// What the tools share: their exit codes, the command line, files and output.

/// Exit codes of a tool.
enum Exit : int {
    ExitFine = 0,
    ExitFinding = 1,  ///< a difference, or data that are not what they should be
    ExitError = 2,    ///< the tool could not do its work
};

/// A failure with one line for the user: what is wrong, and what to do.
class Failure : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// Reads the command line and runs `work`, which returns the exit code. A failure is one line on standard error and
/// ExitError. Adds --version and --help-all, and turns the log of the library off.
int runTool(CLI::App& app, int argc, char** argv, const std::function<Exit()>& work);

/// All bytes of a file; "-" is standard input. Throws Failure.
std::string readBytes(const std::string& path);

/// Writes to standard output. Throws Failure if it takes no more.
void print(const std::string& text);
