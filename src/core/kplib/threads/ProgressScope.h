#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <cstddef>

/// Closes at the end of a C++ scope all scopes that were opened in it by
/// KpProgressInterface::startWorking() and are still open.
class KPLIB_API ProgressScope {
public:
    /// `progress` may be null.
    explicit ProgressScope(KpProgressInterface* progress);
    ProgressScope(const ProgressScope&) = delete;
    ProgressScope& operator=(const ProgressScope&) = delete;
    ~ProgressScope();

private:
    KpProgressInterface* progress_;
    size_t depth_;
};
