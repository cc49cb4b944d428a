#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Decides which changes an editor may make to a tree. Derive from it and pass the object to
/// HxParamBase::setEditCheck() to forbid changes.
///
/// Each check returns whether the change is allowed. This class allows it if the flag of that name
/// is clear in the node (FlagNoRename and so on), independent of the proposed names and values.
/// The tree itself calls no check.
class KPLIB_API HxParamEditCheck {
public:
    virtual ~HxParamEditCheck();

    /// @{
    /// Whether the change is allowed.
    virtual bool checkRename(HxParamBase* node, const char* newName);
    virtual bool checkDelete(HxParamBase* node);
    virtual bool checkInsertBundle(HxParamBundle* into, const char* name);
    virtual bool checkInsertParam(HxParamBundle* into, const char* name);
    virtual bool checkSetValue(HxParameter* node, const char* newValue);
    /// @}

    /// The check of trees without one of their own. It is created on first use without a lock, so
    /// the first call must not run at the same time as another. Never destroyed.
    static HxParamEditCheck* defaultEditCheck();
};
