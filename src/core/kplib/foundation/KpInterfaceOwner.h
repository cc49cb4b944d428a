#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpTypedObject.h>

/// An object with add-on interfaces, which are found by their type. Derived classes provide the
/// reference count. One thread at a time.
class KPLIB_API KpInterfaceOwner : public KpTypedObject {
public:
    /// Ownership of a registered interface.
    enum MemoryPolicy : int {
        StaticMemory = 0,  ///< the owner only lists the interface
        OwnerDeletes = 1,  ///< the owner also deletes it, in notifyDelete()
    };

    KpInterfaceOwner() = default;
    KpInterfaceOwner(const KpInterfaceOwner&) = delete;
    KpInterfaceOwner& operator=(const KpInterfaceOwner&) = delete;

    const KpTypeInfo* getTypeId() const override;
    ~KpInterfaceOwner() override;

    /// Adds one to the count of handles.
    virtual void ref() = 0;
    /// Subtracts one from the count of handles.
    virtual void unref() = 0;

    /// Called before the owner is destroyed: empties the list of interfaces, deletes those it
    /// owns, the last one first, and releases the handles of addHandle().
    virtual void notifyDelete();

    /// @{
    /// The registered type of the class; initClass() registers it.
    static KpTypeInfo* getClassTypeId();
    static void initClass() { getClassTypeId(); }
    /// @}

    /// Adds an interface to the list. With OwnerDeletes the owner takes ownership, except if
    /// memory is exhausted: the caller then keeps the interface.
    void registerInterface(KpTypedObject* object, MemoryPolicy policy);
    /// As registerInterface() with StaticMemory.
    void registerInterfaceStaticMemory(KpTypedObject* object);

    /// Sets a function that is called once, with `data`, at the first query, to attach interfaces
    /// only if one is needed.
    void registerAttachInterfacesOnceCB(void (*callback)(void*), void* data);

    /// Holds a handle to `object` until notifyDelete().
    void addHandle(KpHandable* object);

    /// The interface of that type, the last registered one if there are several. If there is none,
    /// the owner if it is of that type, else null. Null for a null `type`.
    KpTypedObject* getInterface(const KpTypeInfo* type) const;

    /// All interfaces from the last registered to the first, and then the owner.
    void getAllInterfaces(KpDArray<KpTypedObject*>& out) const;

private:
    void attachOnce() const;
    KpTypedObject* self() const { return const_cast<KpInterfaceOwner*>(this); }

    KpDArray<KpTypedObject*> interfaces_;
    KpDArray<KpHandle<KpHandable>> handles_;
    KpDArray<KpTypedObject*> ownedInterfaces_;
    mutable void (*attachCallback_)(void*) = nullptr;  // a query clears it
    void* attachCallbackData_ = nullptr;
};
