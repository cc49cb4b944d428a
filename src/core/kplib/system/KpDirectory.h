#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <vector>

/// Lists, copies and measures folders.
///
/// `pattern` is for kpWildMatch(). With one, names that begin with a dot are left out; without
/// (null), only "." and "..". A link to a folder is no folder here. A folder that cannot be opened
/// or read to its end is a line in the log.
class KPLIB_API KpDirectory {
public:
    /// A directory entry with its times.
    struct FileInfo {
        KpString name;                        ///< without its folder
        unsigned long long creationTime;      ///< of the last change of status, 100 ns since 1601-01-01, to the second
        unsigned long long modificationTime;  ///< likewise
    };

    /// Appends the names in `dir`, sorts all of `names` by bytes and gives their number. -1 if not all can be read;
    /// those that were are appended.
    static long scanSortedByName(const char* dir, KpDArray<KpString>& names, const char* pattern = nullptr,
                                 bool onlyDirectories = false);
    /// The same with files and folders apart; false for -1.
    static bool scanSortedByName(const char* dir, KpDArray<KpString>& files, KpDArray<KpString>& directories,
                                 const char* pattern = nullptr);
    /// The names in `dir` and their times, in place of the content, sorted by name; those whose
    /// times cannot be read are left out. Returns their number, 0 for a folder that cannot be
    /// opened; if a folder cannot be read to its end, the entries before the failure.
    static long scan(const char* dir, std::vector<FileInfo>& out, const char* pattern = nullptr,
                     bool onlyDirectories = false);
    /// As scan(), sorted by creationTime, the oldest first; `times`, if not null, receives it.
    static long scanSortedByCreationTime(const char* dir, KpDArray<KpString>& names,
                                         KpDArray<unsigned long long>* times, const char* pattern = nullptr,
                                         bool onlyDirectories = false);

    /// Whether it can be opened as a folder, also by way of a link.
    static bool isDirectory(const char* path);
    /// Copies the folder `source` with all that is in it: as `target`, or into `target` where that is a folder. Links
    /// are copied as links. Pipes, sockets and devices are left out. 0, also if single entries are left out or fail,
    /// each with an error in the log, or -1 if the new folder cannot be made.
    static int copy(const char* source, const char* target);
    /// Bytes that a user can write where the file `path` lies (its folder is asked); -1 if unknown.
    static long long freeSpace(const char* path);
};

/// Deletes a folder with all that is in it; links are deleted, not followed. 0, or -1 if something stays: each entry
/// that cannot be deleted and each folder within that cannot be read is an error in the log. A `path` that is no folder
/// that can be read is -1 without one, and so is exhausted memory, which leaves what was not reached.
KPLIB_API int remove_dir(const char* path) noexcept;
