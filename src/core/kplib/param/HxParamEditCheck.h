#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// What an editor asks before it changes a tree; derive from it and give it to HxParamBase::setEditCheck() for a veto.
///
/// Each check tells whether the change is allowed. Here that is so when the flag of that name is clear in the node
/// (FlagNoRename and so on); the proposed names and values play no part. The tree itself asks nothing.
class KPLIB_API HxParamEditCheck {
public:
    virtual ~HxParamEditCheck();

    virtual bool checkRename(HxParamBase* node, const char* newName);
    virtual bool checkDelete(HxParamBase* node);
    virtual bool checkInsertBundle(HxParamBundle* into, const char* name);
    virtual bool checkInsertParam(HxParamBundle* into, const char* name);
    virtual bool checkSetValue(HxParameter* node, const char* newValue);

    /// The one that serves where none is set: made on first use without a lock, so that first use belongs to one
    /// thread, and never destroyed.
    static HxParamEditCheck* defaultEditCheck();
};
