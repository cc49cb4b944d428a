#pragma once

#include "Abort.h"

#include <kplib/log/KpResult.h>

#include <string>

/// A folder that is filled at once. Files are written into a hidden folder on the same file system: inside the target
/// if that exists, else beside it. publish() moves them to their places. Without publish() nothing remains.
class OutputFolder {
public:
    OutputFolder() = default;
    OutputFolder(const OutputFolder&) = delete;
    OutputFolder& operator=(const OutputFolder&) = delete;
    ~OutputFolder();

    KpResult open(const std::string& target);

    /// Moves every file to its place, where it replaces one of the same name. If one cannot be moved, the others are
    /// moved all the same, it stays in the hidden folder, and the failure names both.
    KpResult publish();

    /// Where to write a file of that name until publish().
    std::string pathOf(const char* name) const { return working_ + "/" + name; }
    const std::string& working() const { return working_; }

private:
    KpResult publishFiles();

    std::string target_, working_;
    bool isInside_ = false;
    Unfinished unfinished_;
};
