#pragma once

#include <kplib/foundation/KpExport.h>

// Design by contract: switches and a hook for the checking macros of an application. The library
// stores them but does not use them. Set them at start-up, before other threads start.

/// The kind of a broken contract.
enum DbCEventType : int {
    DbCPrecondition = 0,   ///< of a caller
    DbCPostcondition = 1,  ///< of the function itself
    DbCInvariant = 2,      ///< of an object
    DbCAssertion = 3,      ///< at a place in the code
};

/// Whether broken contracts are handled at all.
extern KPLIB_API bool kp_DbC_handleEvents;
/// Whether handling a broken contract stops at a breakpoint.
extern KPLIB_API bool kp_DbC_breakOnEvent;

/// Receives a broken contract: kind, condition, file, line, function and a message for the reader; texts may be null.
using DbCCallback = void (*)(DbCEventType type, const char* condition, const char* file, unsigned int line,
                             const char* function, const char* message);

/// The hook that the macros call; null (the default) for none.
KPLIB_API DbCCallback kp_DbC_callback();
/// Replaces the hook.
KPLIB_API void kp_DbC_callbackSet(DbCCallback callback);
