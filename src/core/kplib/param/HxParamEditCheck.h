#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// Decides which changes an editor may make to a tree. Derive from it and pass the object to
/// HxParamBase::setEditCheck() to forbid changes.
///
/// Each check returns whether the change is allowed. In this class it is allowed if the flag of
/// that name is clear in the node (FlagNoRename and so on), whatever the proposed names and
/// values. The tree itself calls no check.
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

    /// The check of trees that have none of their own. It is made on first use without a lock, so
    /// one thread makes the first call, and is never destroyed.
    static HxParamEditCheck* defaultEditCheck();
};
