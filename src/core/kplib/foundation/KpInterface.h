#pragma once

#include <kplib/foundation/KpInterfaceOwner.h>

/// Base of an interface that is attached to an owner.
class KPLIB_API KpInterface : public KpTypedObject {
public:
    /// Registers this with `owner`; a null owner makes a new KpInterfaceOwnerDefaultImpl, which goes with the last
    /// handle to it.
    KpInterface(KpInterfaceOwner* owner, KpInterfaceOwner::MemoryPolicy policy);
    KpInterface(const KpInterface&) = delete;
    KpInterface& operator=(const KpInterface&) = delete;

    const KpTypeInfo* getTypeId() const override;
    /// Doesn't unregister the interface: the owner has to be gone, or never asked again.
    ~KpInterface() override;

    static KpTypeInfo* getClassTypeId();
    static void initClass() { getClassTypeId(); }

    KpInterfaceOwner* owner() const { return owner_; }

private:
    KpInterfaceOwner* owner_;
};
