#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Gathers the names of files in a tree of folders.
class KPLIB_API KpFilenameCollector {
public:
    /// Appends `dir`/name for all names in `dir` that kpWildMatch() finds to match `pattern` (folders too), in
    /// descending order, then those of each folder in it, likewise from the last to the first. Names that begin with a
    /// dot are left out. Links to folders are followed, except those that lead back to a folder on the way to them.
    /// Nothing for null, or where there is no folder.
    static void collect(KpDArray<KpString>& out, const char* pattern, const char* dir);
};
