#include <kplib/foundation/KpInterfaceOwner.h>

#include <utility>

namespace {

[[maybe_unused]] const KpTypeInfo* const registered = KpInterfaceOwner::getClassTypeId();

}  // namespace

KpTypeInfo* KpInterfaceOwner::getClassTypeId()
{
    static KpTypeInfo type("KpInterfaceOwner", nullptr, KpTypedObject::getClassTypeId(), nullptr);
    return &type;
}

const KpTypeInfo* KpInterfaceOwner::getTypeId() const
{
    return getClassTypeId();
}

KpInterfaceOwner::~KpInterfaceOwner() = default;

void KpInterfaceOwner::notifyDelete()
{
    interfaces_.resize(0);
    while (ownedInterfaces_.size() > 0) {
        // Removed from the list before it is deleted, as its destructor may call this function.
        KpTypedObject* const last = ownedInterfaces_[ownedInterfaces_.size() - 1];
        ownedInterfaces_.resize(ownedInterfaces_.size() - 1);
        delete last;
    }
    handles_.clear();
}

void KpInterfaceOwner::registerInterface(KpTypedObject* object, MemoryPolicy policy)
{
    ownedInterfaces_.reserveOne();
    registerInterfaceStaticMemory(object);
    if (policy == OwnerDeletes)
        ownedInterfaces_.append(object);
}

void KpInterfaceOwner::registerInterfaceStaticMemory(KpTypedObject* object)
{
    interfaces_.reserveOne();
    interfaces_.append(object);
}

void KpInterfaceOwner::registerAttachInterfacesOnceCB(void (*callback)(void*), void* data)
{
    attachCallback_ = callback;
    attachCallbackData_ = data;
}

void KpInterfaceOwner::addHandle(KpHandable* object)
{
    handles_.reserveOne();
    handles_.append(object);
}

void KpInterfaceOwner::attachOnce() const
{
    if (const auto attach = std::exchange(attachCallback_, nullptr))
        attach(attachCallbackData_);
}

KpTypedObject* KpInterfaceOwner::getInterface(const KpTypeInfo* type) const
{
    attachOnce();
    if (!type)
        return nullptr;
    for (long i = interfaces_.size() - 1; i >= 0; --i) {
        if (interfaces_[i]->getTypeId()->isOfType(type))
            return interfaces_[i];
    }
    return getTypeId()->isOfType(type) ? self() : nullptr;
}

void KpInterfaceOwner::getAllInterfaces(KpDArray<KpTypedObject*>& out) const
{
    attachOnce();
    out.resize(0);
    for (long i = interfaces_.size() - 1; i >= 0; --i)
        out.append(interfaces_[i]);
    out.append(self());
}
