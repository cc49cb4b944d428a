#pragma once

#include <kplib/log/KpResult.h>

#include <string>

/// A folder that appears whole or not at all: files are written into a hidden one beside it, which takes its name in
/// publish() and is removed otherwise. An existing folder keeps its place; its files of the same names are replaced.
class OutputFolder {
public:
    OutputFolder() = default;
    OutputFolder(const OutputFolder&) = delete;
    OutputFolder& operator=(const OutputFolder&) = delete;
    ~OutputFolder();

    KpResult open(const std::string& target);
    KpResult publish();

    /// Where to write a file of that name until publish().
    std::string pathOf(const char* name) const { return working_ + "/" + name; }
    const std::string& working() const { return working_; }

private:
    std::string target_, working_;
};
