#pragma once

#include <kplib/foundation/KpInterfaceOwner.h>

/// An owner that is deleted with its last handle, together with the interfaces that it owns.
class KPLIB_API KpInterfaceOwnerDefaultImpl : public KpInterfaceOwner, public KpHandable {
public:
    const KpTypeInfo* getTypeId() const override;
    ~KpInterfaceOwnerDefaultImpl() override;

    void ref() override;
    /// Subtracts one from the count of handles. The last one deletes the owner.
    void unref() override;
    void notifyDelete() override;
};
