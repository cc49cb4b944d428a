#pragma once

#include <kplib/foundation/KpExport.h>

/// The severity of a message, in ascending order.
enum KpLogLevel : int {
    KpLogDebug = 0,     ///< for developers
    KpLogInfo = 1,      ///< what happens
    KpLogWarning = 2,   ///< may be wrong, and work goes on
    KpLogError = 3,     ///< an operation failed
    KpLogCritical = 4,  ///< the program may not go on
    KpLogOff = 5,       ///< only as a threshold: no message reaches it
};

/// "D", "I", "W", "E" or "C"; "" for anything that is no level of a message.
KPLIB_API const char* KpLogLevelToString(KpLogLevel level);

/// The level whose letter, in upper case, begins the text: "D", "Debug" and "DX" are all KpLogDebug. Anything else, or
/// a null `s`, gives KpLogCritical and a false `ok`. `ok` may be null.
KPLIB_API KpLogLevel KpLogLevelFromString(const char* s, bool* ok);
