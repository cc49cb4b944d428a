#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

#include <ctime>

/// A string that is a path: operations on the name, questions about what it names, and names for new files.
///
/// Separators are slashes. Nothing throws but for exhausted memory, and nothing is logged: a failure is false, 0 or
/// what is said below.
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
    /// True for any directory; a file by its rights.
    bool isWriteable() const;
    /// Whether it is a folder, or a link to one.
    bool isDirectory() const;
    /// Whether the first character isn't a slash.
    bool isRelative() const { return c_str()[0] != '/'; }
    /// Seconds since 1970, 0 on failure.
    std::time_t getModTime() const;
    /// Likewise, of the last access.
    std::time_t getAccessTime() const;
    /// The time of the last change of status: there is no time of birth.
    std::time_t getCreateTime() const;
    /// Bytes; all bits set on failure.
    unsigned long long fileSize() const;
    /// Type and rights as the system has them, of what can be opened for reading; else 0.
    int getMode() const;
    /// Sets the rights; false on failure.
    bool setMode(int mode) const;
    /// Makes an empty file of it, or empties it.
    bool create(int mode) const;
    /// Deletes the file; false on failure.
    bool unlink() const;
    /// Renames the file; false on failure. The object takes `newName` in either case.
    bool rename(const char* newName);
    /// Copies contents and rights to the file `target`; false if either cannot be opened, or not
    /// all can be read and written, which leaves no `target`. A file copied onto itself stays.
    bool copy(const char* target) const;

    // The text alone; the static ones are for any path, null counts as empty.

    /// What follows the last slash.
    static const char* basename(const char* path);
    /// As above, of this path.
    const char* basename() const { return basename(c_str()); }
    /// From the last '.' after the last slash, with the dot; empty for none. Of a hidden file the
    /// whole name.
    static const char* extension(const char* path);
    /// As above, of this path.
    const char* extension() const { return extension(c_str()); }
    /// Up to the last slash, that included, with backslashes as slashes; false, and `out` empty, without one.
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
    /// Tidies the text without a look at the file system: backslashes, "//", "/./" and "x/..".
    /// Works on the three characters of "/..", so "a/b/..c" gives "ac". Intentional: stored names
    /// depend on it.
    void pack();
    /// Makes an absolute path of a relative one, "~/" included, and follows its links if it
    /// exists. An absolute one stays as it is. If the result ends in another character than the
    /// text before, that character is appended: this keeps a trailing slash, and also applies to a
    /// link whose target ends differently.
    void expandPath();
    /// pack(), expandPath(), and without a slash at the end.
    void canonizePath();
    /// Rewrites this path relative to the folder that `base` lies in. Where the two have no first piece in common it is
    /// only packed.
    void makeRelativeTo(const KpFilename& base);

    /// `pattern` with `number` in place of its last run of '#', padded with zeros; without one, numbers from 2 on stand
    /// with four digits before the last dot.
    static void enumerate(KpString& result, const char* pattern, int number);
    /// If something of this name exists, puts the first of .1, .2 ... before the extension that makes a new one.
    void makeUnique();
    /// A name that does not exist, in `dir` as it is or, for null, in the system's temporary
    /// folder. The file is not made.
    static KpFilename getTempFilename(const char* dir);
    /// A place for a new file: `dir` below `root` (the system's temporary folder, if empty), made
    /// if needed, with `dated` by year, month and day; and a `name` of local time and process,
    /// with `withUuid` unique anywhere. Both are empty if the folder cannot be made.
    static void generateFilePath(KpString& dir, KpString& name, const KpString& root, bool dated, bool withUuid);
};
