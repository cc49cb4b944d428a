#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// A folder for temporary files, which can remove itself.
class KPLIB_API KpTmpDir {
public:
    /// Sets a new path by makeUnique(), and creates the folder if `createNow`; check doesExist()
    /// for success. The destructor removes the folder by remove_dir() if `removeOnDestruction`.
    KpTmpDir(const char* name, bool createNow, bool removeOnDestruction);
    KpTmpDir(const KpTmpDir&) = delete;
    KpTmpDir& operator=(const KpTmpDir&) = delete;
    ~KpTmpDir();

    /// Sets a path that does not exist: `name` (null: the present path), with .2, .3 ... appended
    /// if needed, and a slash at the end. Of a name that begins with neither "/" nor "./" only the
    /// last part is used, in the system's temporary folder. To a name that ends in a slash, "tmp"
    /// is appended. Another process may create the same path before create().
    void makeUnique(const char* name);
    /// Makes the folder with exactly the rights `mode`.
    bool create(int mode);
    /// Whether the folder exists.
    bool doesExist() const;
    /// As remove_dir().
    int remove();

    /// The path. It ends in a slash after makeUnique().
    const KpString& path() const { return path_; }

    /// The first of TMPDIR, TEMP and TMP that is set, else /tmp, with a slash at the end; valid until this thread's
    /// next call.
    static const char* getSystemTmpPath();

private:
    KpString path_;
    bool removeOnDestruction_;
};
