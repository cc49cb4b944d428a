#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Collects the names of files in a tree of folders.
class KPLIB_API KpFilenameCollector {
public:
    /// Appends `dir`/name for all names in `dir` that match `pattern` by kpWildMatch() (folders
    /// too), in descending order, then those of each folder in it, also in descending order. Names
    /// that begin with a dot are left out. Links to folders are followed, except links to a folder
    /// on the path to them. Appends nothing for null or if there is no folder.
    static void collect(KpDArray<KpString>& out, const char* pattern, const char* dir);
};
