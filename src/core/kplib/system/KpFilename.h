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
    KpFilename(const char* name) : KpString(name) {}
    KpFilename(const KpString& name) : KpString(name) {}
    KpFilename& operator=(const char* name)
    {
        KpString::operator=(name);
        return *this;
    }
    KpFilename& operator=(const KpString& name)
    {
        KpString::operator=(name);
        return *this;
    }

    // What the name names.

    bool doesExist() const;
    bool isReadable() const;
    /// True for any directory; a file by its rights.
    bool isWriteable() const;
    bool isDirectory() const;
    /// Whether the first character isn't a slash.
    bool isRelative() const { return c_str()[0] != '/'; }
    /// Seconds since 1970, 0 on failure.
    std::time_t getModTime() const;
    std::time_t getAccessTime() const;
    /// The time of the last change of status: there is no time of birth.
    std::time_t getCreateTime() const;
    /// Bytes; all bits set on failure.
    unsigned long long fileSize() const;
    /// Type and rights as the system has them, of what can be opened for reading; else 0.
    int getMode() const;
    bool setMode(int mode) const;
    /// Makes an empty file of it, or empties it.
    bool create(int mode) const;
    bool unlink() const;
    /// The object takes `newName` whether or not the renaming works; the result tells.
    bool rename(const char* newName);
    /// Copies contents and rights to the file `target`; false if either can't be opened, or not all can be read and
    /// written, which leaves no `target`. A file copied onto itself stays.
    bool copy(const char* target) const;

    // The text alone; the static ones are for any path, null counts as empty.

    /// What follows the last slash.
    static const char* basename(const char* path);
    const char* basename() const { return basename(c_str()); }
    /// From the last '.' behind the last slash, with the dot; empty for none. Of a hidden file the whole name.
    static const char* extension(const char* path);
    const char* extension() const { return extension(c_str()); }
    /// Up to the last slash, that included, with backslashes as slashes; false, and `out` empty, without one.
    static bool dirname(const char* path, KpString& out);
    bool dirname(KpString& out) const { return dirname(c_str(), out); }
    KpString dirname() const;

    void removeExtension();
    /// Each backslash becomes a slash.
    void fixSlashes();
    /// Adds a slash and `name`, and returns this object.
    KpFilename& appendFile(const KpString& name);
    /// Tidies the text without a look at the file system: backslashes, "//", "/./" and "x/..". Works on the three
    /// characters of "/..", so "a/b/..c" gives "ac"; that is meant.
    void pack();
    /// Makes an absolute path of a relative one, "~/" included, and follows its links if it exists. An absolute one
    /// stays as it is. The last character of the text before is kept behind the result, which is for a trailing slash,
    /// and also happens to a link whose target ends differently; that is meant.
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
    /// A name that doesn't exist, in `dir` as it is or, for null, in the system's temporary folder. The file is not
    /// made.
    static KpFilename getTempFilename(const char* dir);
    /// A place for a new file: `dir` below `root` (the system's temporary folder, if empty), made if needed, with
    /// `dated` by year, month and day; and a `name` of local time and process, with `withUuid` unique anywhere. Both
    /// are empty if the folder can't be had.
    static void generateFilePath(KpString& dir, KpString& name, const KpString& root, bool dated, bool withUuid);
};
