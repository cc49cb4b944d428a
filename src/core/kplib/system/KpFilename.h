#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <ctime>

/// A string that is a path: operations on the name, questions about what it names, and names for new files.
///
/// Separators are slashes. Only exhausted memory throws, and nothing is logged: a failure is
/// false, 0 or the value stated below.
class KPLIB_API KpFilename : public KpString {
public:
    KpFilename() = default;
    /// @{
    /// That path.
    KpFilename(const char* name) : KpString(name) {}
    KpFilename(const KpString& name) : KpString(name) {}
    /// @}

    /// Replaces the path.
    KpFilename& operator=(const char* name)
    {
        KpString::operator=(name);
        return *this;
    }
    /// As above.
    KpFilename& operator=(const KpString& name)
    {
        KpString::operator=(name);
        return *this;
    }

    // What the path names.

    /// Whether something of that name exists.
    bool doesExist() const;
    /// Whether this process may read it.
    bool isReadable() const;
    /// Whether it is a directory, or a file that this process may write.
    bool isWriteable() const;
    /// Whether it is a folder, or a link to one.
    bool isDirectory() const;
    /// Whether the first character isn't a slash.
    bool isRelative() const { return c_str()[0] != '/'; }
    /// Seconds since 1970, 0 on failure.
    std::time_t getModTime() const;
    /// The time of the last access, likewise.
    std::time_t getAccessTime() const;
    /// The time of the last change of status, since there is no time of creation.
    std::time_t getCreateTime() const;
    /// Bytes; all bits set on failure.
    unsigned long long fileSize() const;
    /// Type and rights as the system returns them if the file can be opened for reading, else 0.
    int getMode() const;
    /// Sets the rights; false on failure.
    bool setMode(int mode) const;
    /// Creates an empty file, or truncates an existing one.
    bool create(int mode) const;
    /// Deletes the file; false on failure.
    bool unlink() const;
    /// Renames the file and returns false on failure. The object takes `newName` in both cases.
    bool rename(const char* newName);
    /// Copies contents and rights to the file `target`. Returns false if either cannot be opened,
    /// or if not all can be read and written, which leaves no `target`. A file that is copied to
    /// itself is unchanged.
    bool copy(const char* target) const;

    // Operations on the text only. The static functions accept any path; null counts as empty.

    /// The part after the last slash.
    static const char* basename(const char* path);
    /// As above, of this path.
    const char* basename() const { return basename(c_str()); }
    /// The part from the last '.' after the last slash, with the dot; empty if there is none. For
    /// a hidden file that may be the whole name.
    static const char* extension(const char* path);
    /// As above, of this path.
    const char* extension() const { return extension(c_str()); }
    /// Sets `out` to the part up to the last slash, included, with backslashes as slashes. Returns
    /// false and empties `out` if there is none.
    static bool dirname(const char* path, KpString& out);
    /// As above, of this path.
    bool dirname(KpString& out) const { return dirname(c_str(), out); }
    /// The same as a result.
    KpString dirname() const;

    /// Removes what extension() returns.
    void removeExtension();
    /// Each backslash becomes a slash.
    void fixSlashes();
    /// Adds a slash and `name`, and returns this object.
    KpFilename& appendFile(const KpString& name);
    /// Normalises the text without access to the file system: backslashes, "//", "/./" and "x/..".
    /// Replaces the three characters "/..", so "a/b/..c" gives "ac". Intentional: stored names
    /// depend on it.
    void pack();
    /// Makes a relative path absolute, "~/" included, and follows its links if it exists. An
    /// absolute path is unchanged. If the last character of the result differs from that of the
    /// original text, that character is appended: this keeps a trailing slash, and also applies to
    /// a link whose target ends differently.
    void expandPath();
    /// Calls pack() and expandPath(), and removes a trailing slash.
    void canonizePath();
    /// Rewrites this path relative to the folder of `base`. If the two have no common first part,
    /// only packs it.
    void makeRelativeTo(const KpFilename& base);

    /// Sets `result` to `pattern` with its last run of '#' replaced by `number`, padded with
    /// zeros. Without such a run, numbers from 2 on are inserted before the last dot with four
    /// digits.
    static void enumerate(KpString& result, const char* pattern, int number);
    /// If the path exists, inserts the first of .1, .2 ... before the extension that gives a path
    /// that does not exist.
    void makeUnique();
    /// A name that does not exist, in `dir`, or for null in the system's temporary folder. The
    /// file is not created.
    static KpFilename getTempFilename(const char* dir);
    /// Computes a path for a new file. `dir` is `root` (the system's temporary folder if empty),
    /// with `dated` a folder in it by year, month and day; it is created if needed. `name`
    /// consists of local time and process, with `withUuid` also of a UUID. Both are empty if the
    /// folder cannot be created.
    static void generateFilePath(KpString& dir, KpString& name, const KpString& root, bool dated, bool withUuid);
};
