#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Creates DICOM unique identifiers for new objects (PS3.5, 9): root, version, a number for the
/// kind of object, the node, a counter and the process, separated by dots.
///
/// The counter is the time of day, and is incremented if the clock does not advance or goes back:
/// within a process it never repeats, for all objects and threads. The root must be short enough
/// for the limit of 64 characters. createUID() may be called on one object by many threads, for
/// valid types; all else is for one thread.
class KPLIB_API KpCreateUIDs {
public:
    /// The kind of object, in the numbering of the layer above. The UID contains 2 to 6.
    enum UIDtype : int {
        UIDtype0 = 0,  ///< 2 in the UID
        UIDtype1 = 1,  ///< 3 in the UID
        UIDtype2 = 2,  ///< 4 in the UID
        UIDtype3 = 3,  ///< 5 in the UID
        UIDtype4 = 4,  ///< 6 in the UID
    };

    KpCreateUIDs();

    /// Version and root as they are at first; the last error stays.
    void reset();

    /// False for an empty text (or null), which is an error and changes nothing.
    bool setRootUID(const char* root);
    /// Likewise for the version.
    bool setVersion(const char* version);

    /// Replaces the text of lastError().
    void setLastError(const KpString& text) { lastError_ = text; }
    /// The text of the last failure, "" at first; valid until the next one.
    const char* lastError() const { return lastError_.c_str(); }

    /// Sets `uid` to a new identifier. For an unknown type sets an error, returns false and
    /// empties `uid`. Takes less than a microsecond.
    bool createUID(UIDtype type, KpString& uid);

    /// The local time: the full year, the month from 1.
    static void getDateTime(int& year, int& month, int& day, int& hour, int& minute, int& second);

private:
    bool setText(KpString& field, const char* text, const char* error);

    KpString version_;
    KpString rootUID_;
    KpString lastError_;
};
