#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// Makes DICOM unique identifiers for new objects (PS3.5, 9): root, version, a number for the kind of object, the node,
/// a counter and the process, separated by dots.
///
/// The counter is the time of day, and is incremented where the clock does not advance or goes
/// back: within a process it never repeats, for all objects and threads. That the text stays
/// within the 64 characters of DICOM is up to the root. createUID() may be called on one object by
/// many threads, for types that there are; all else is for one thread.
class KPLIB_API KpCreateUIDs {
public:
    /// What the identifier is for; the values of the layer above, which are 2 to 6 in the UID.
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

    /// A new identifier into `uid`. An unknown type is an error: false, and `uid` is empty. Under a microsecond.
    bool createUID(UIDtype type, KpString& uid);

    /// The local time: the full year, the month from 1.
    static void getDateTime(int& year, int& month, int& day, int& hour, int& minute, int& second);

private:
    bool setText(KpString& field, const char* text, const char* error);

    KpString version_;
    KpString rootUID_;
    KpString lastError_;
};
