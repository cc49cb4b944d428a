#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpString.h>

/// The operating system.
class KPLIB_API KpOSInfo {
public:
    /// "Linux 6.1.0": the system's name and version. The argument isn't used.
    static KpString getOSName(bool ignored = false);
    /// False.
    static bool isWow64Process() { return false; }
};
