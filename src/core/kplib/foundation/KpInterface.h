#pragma once

#include <kplib/foundation/KpInterfaceOwner.h>

/// Base of an interface that is attached to an owner.
class KPLIB_API KpInterface : public KpTypedObject {
public:
    /// Registers this with `owner`. For a null owner, creates a KpInterfaceOwnerDefaultImpl, which
    /// is deleted with the last handle to it.
    KpInterface(KpInterfaceOwner* owner, KpInterfaceOwner::MemoryPolicy policy);
    KpInterface(const KpInterface&) = delete;
    KpInterface& operator=(const KpInterface&) = delete;

    const KpTypeInfo* getTypeId() const override;
    /// Does not unregister the interface: the owner must be destroyed already, or not be queried
    /// again.
    ~KpInterface() override;

    /// @{
    /// The registered type of the class; initClass() registers it.
    static KpTypeInfo* getClassTypeId();
    static void initClass() { getClassTypeId(); }
    /// @}

    /// The owner, never null.
    KpInterfaceOwner* owner() const { return owner_; }

private:
    KpInterfaceOwner* owner_;
};
