#pragma once

#include <kplib/foundation/KpExport.h>

/// Base of objects with one operation, for clients.
class KPLIB_API KpCallable {
public:
    KpCallable() = default;
    /// @{
    /// Copies nothing.
    KpCallable(const KpCallable&) = default;
    KpCallable& operator=(const KpCallable&) = default;
    /// @}

    virtual ~KpCallable();

    /// Performs the operation.
    virtual void call() = 0;
};
