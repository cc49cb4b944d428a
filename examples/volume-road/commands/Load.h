#pragma once

#include "Job.h"
#include "Road.h"

#include <string>
#include <vector>

/// The two stages that every command on a series begins with: its headers are read and its warnings are printed, then
/// its voxels are read.
void loadSeries(const Job& job, Road& road, KpProgressInterface& progress, Series& series, Volume& volume,
                HxParamBundle& root);

/// Prints each warning on standard error, and into the log.
void printWarnings(const std::vector<std::string>& warnings);

/// Writes a text to standard output; a failure if it does not arrive there.
KpResult printText(const std::string& text);
