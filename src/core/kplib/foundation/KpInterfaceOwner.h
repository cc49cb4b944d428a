#pragma once

#include <kplib/foundation/KpDArray.h>
#include <kplib/foundation/KpHandable.h>
#include <kplib/foundation/KpHandle.h>
#include <kplib/foundation/KpTypedObject.h>

/// An object that carries add-on interfaces, found by their type. It is reference counted by what derives from it. One
/// thread at a time.
class KPLIB_API KpInterfaceOwner : public KpTypedObject {
public:
    /// Who deletes a registered interface.
    enum MemoryPolicy : int {
        StaticMemory = 0,  ///< the owner only lists the interface
        OwnerDeletes = 1,  ///< the owner also deletes it, in notifyDelete()
    };

    KpInterfaceOwner() = default;
    KpInterfaceOwner(const KpInterfaceOwner&) = delete;
    KpInterfaceOwner& operator=(const KpInterfaceOwner&) = delete;

    const KpTypeInfo* getTypeId() const override;
    ~KpInterfaceOwner() override;

    /// Counts one handle more.
    virtual void ref() = 0;
    /// Counts one handle less.
    virtual void unref() = 0;

    /// Runs before the owner is destroyed: empties the list of interfaces, deletes those it owns,
    /// the last one first, and drops the handles of addHandle().
    virtual void notifyDelete();

    /// @{
    /// The registered type of the class; initClass() registers it.
    static KpTypeInfo* getClassTypeId();
    static void initClass() { getClassTypeId(); }
    /// @}

    /// Adds an interface to the list. With OwnerDeletes the owner takes it over, unless memory is
    /// exhausted: then the caller keeps it.
    void registerInterface(KpTypedObject* object, MemoryPolicy policy);
    /// As registerInterface() with StaticMemory.
    void registerInterfaceStaticMemory(KpTypedObject* object);

    /// Sets what runs once, with `data`, at the first query, to attach interfaces only when one is
    /// needed.
    void registerAttachInterfacesOnceCB(void (*callback)(void*), void* data);

    /// Keeps the object alive as long as this owner.
    void addHandle(KpHandable* object);

    /// The interface of that type, the last registered one of several; the owner itself if it is of that type and no
    /// interface is; else, and for a null `type`, null.
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
