#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Sets the default module of the process's log for the length of a scope; such scopes nest.
class KPLIB_API KpLogFileDefaultModuleModifier {
public:
    /// `module` may be null, for none.
    explicit KpLogFileDefaultModuleModifier(const char* module);
    KpLogFileDefaultModuleModifier(const KpLogFileDefaultModuleModifier&) = delete;
    KpLogFileDefaultModuleModifier& operator=(const KpLogFileDefaultModuleModifier&) = delete;
    ~KpLogFileDefaultModuleModifier();

private:
    KpLogFileDefaultModuleModifier();

    KpString* saved_;
};
