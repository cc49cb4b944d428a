#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// A folder of its own for temporary files, which can remove itself.
class KPLIB_API KpTmpDir {
public:
    /// Takes a new name by makeUnique(), and makes the folder if `createNow`; check doesExist()
    /// for success. The destructor removes the folder by remove_dir() if `removeOnDestruction`.
    KpTmpDir(const char* name, bool createNow, bool removeOnDestruction);
    KpTmpDir(const KpTmpDir&) = delete;
    KpTmpDir& operator=(const KpTmpDir&) = delete;
    ~KpTmpDir();

    /// Takes the path `name` (null: as it is) where nothing exists: with .2, .3 ... if needed, and
    /// a slash at the end. A name that begins with neither "/" nor "./" lies in the system's
    /// temporary folder with its last part alone; a name that ends in a slash gets "tmp" appended.
    /// Another process may take the name before create().
    void makeUnique(const char* name);
    /// Makes the folder with exactly the rights `mode`.
    bool create(int mode);
    /// Whether the folder exists.
    bool doesExist() const;
    /// As remove_dir().
    int remove();

    /// With a slash at the end, once makeUnique() has run.
    const KpString& path() const { return path_; }

    /// The first of TMPDIR, TEMP and TMP that is set, else /tmp, with a slash at the end; valid until this thread's
    /// next call.
    static const char* getSystemTmpPath();

private:
    KpString path_;
    bool removeOnDestruction_;
};
