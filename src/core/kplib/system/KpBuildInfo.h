#pragma once

#include <kplib/foundation/KpExport.h>

#include <string>

/// Values that the build stores in the library. Thread-safe.
class KPLIB_API KpBuildInfo {
public:
    /// Contents of getBuildString(), to be combined.
    enum BuildStringFlag : int {
        BuildNumber = 1,  ///< the build number as a part of the version
        Comments = 2,     ///< the comments of the build
        Platform = 4,     ///< the name of the platform
        BuildTime = 8,    ///< date and time of the build
    };

    KpBuildInfo() = delete;

    /// Writes major, minor, patch and build number to v[0] to v[3].
    static void getVersion(int* v);
    /// Whether this is not a release.
    static bool isSnapshotBuild();
    /// The text of a tag, empty for a key that isn't one: VERSION_MAJOR, VERSION_MINOR, VERSION_PATCH, VERSION_BUILD,
    /// VERSION_STRING, VERSION_SHA1 (the source revision, 40 zeros where there is none), VERSION_PRODUCT_NAME,
    /// VERSION_COMMENTS, VERSION_BUILD_TIME (yyyy-Mon-dd hh:mm:ss in UTC), VERSION_COPYRIGHT, VERSION_COMPANY.
    static std::string getBuildTag(const std::string& key);
    /// One line for a reader: "1.2.3 (Build 4)" for 0, "1.2.3.4" for 1, "1.2.3 (Linux, 64-bit Build 4)" for 4.
    static std::string getBuildString(int flags);
};
