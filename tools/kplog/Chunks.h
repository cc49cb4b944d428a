#pragma once

#include <string>
#include <vector>

/// The files in the order in which they were written, as far as their first lines name the file before; else as given.
/// With `withEarlier` the files before them, as long as they are there. Throws Failure for a file that cannot be read.
std::vector<std::string> orderedChunks(const std::vector<std::string>& files, bool withEarlier);

/// The log file in the same folder that continues `file`; empty if there is none.
std::string nextChunk(const std::string& file);
