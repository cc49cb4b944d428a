#pragma once

#include <kplib/foundation/KpInterfaceOwner.h>

/// An owner that is deleted with its last handle, and its owned interfaces with it.
class KPLIB_API KpInterfaceOwnerDefaultImpl : public KpInterfaceOwner, public KpHandable {
public:
    const KpTypeInfo* getTypeId() const override;
    ~KpInterfaceOwnerDefaultImpl() override;

    void ref() override;
    /// Counts one handle less; the last one deletes the owner.
    void unref() override;
    void notifyDelete() override;
};
