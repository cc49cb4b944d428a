#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

#include <cstddef>

/// Closes at the end of a C++ scope what was opened in it with KpProgressInterface::startWorking(), and nothing else;
/// what was closed by hand is not closed again.
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
