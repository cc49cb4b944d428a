#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <vector>

/// Lists, copies and measures folders.
///
/// `pattern` is a pattern of kpWildMatch(). With a pattern, names that begin with a dot are left
/// out; with null, only "." and ".." are. A link to a folder does not count as a folder. A folder
/// that cannot be opened or read to its end is a line in the log.
class KPLIB_API KpDirectory {
public:
    /// A directory entry with its times.
    struct FileInfo {
        KpString name;                        ///< without its folder
        unsigned long long creationTime;      ///< of the last change of status, 100 ns since 1601-01-01, to the second
        unsigned long long modificationTime;  ///< likewise
    };

    /// Appends the names in `dir` to `names`, sorts all of `names` by bytes and returns their
    /// number. Returns -1 if not all can be read; the names that were read are appended.
    static long scanSortedByName(const char* dir, KpDArray<KpString>& names, const char* pattern = nullptr,
                                 bool onlyDirectories = false);
    /// The same with files and folders apart; false for -1.
    static bool scanSortedByName(const char* dir, KpDArray<KpString>& files, KpDArray<KpString>& directories,
                                 const char* pattern = nullptr);
    /// Replaces `out` by the names in `dir` and their times, sorted by name. Entries whose times
    /// cannot be read are left out. Returns their number, 0 for a folder that cannot be opened. If
    /// a folder cannot be read to its end, `out` has the entries before the failure.
    static long scan(const char* dir, std::vector<FileInfo>& out, const char* pattern = nullptr,
                     bool onlyDirectories = false);
    /// As scan(), sorted by creationTime, the oldest first; `times`, if not null, receives it.
    static long scanSortedByCreationTime(const char* dir, KpDArray<KpString>& names,
                                         KpDArray<unsigned long long>* times, const char* pattern = nullptr,
                                         bool onlyDirectories = false);

    /// Whether `path` can be opened as a folder, also through a link.
    static bool isDirectory(const char* path);
    /// Copies the folder `source` with all its contents: as `target`, or into `target` if that is
    /// a folder. Links are copied as links. Pipes, sockets and devices are left out. Returns -1 if
    /// the new folder cannot be created, else 0, also if single entries are left out or fail, each
    /// with an error in the log.
    static int copy(const char* source, const char* target);
    /// Number of bytes that a user can write in the folder of the file `path`; -1 if unknown.
    static long long freeSpace(const char* path);
};

/// Deletes a folder with all its contents. Links are deleted, not followed. Returns 0, or -1 if an
/// entry remains: each entry that cannot be deleted and each folder inside that cannot be read is
/// an error in the log. Returns -1 without a log line if `path` is not a readable folder, or if
/// memory runs out, which leaves the entries not yet reached.
KPLIB_API int remove_dir(const char* path) noexcept;
