#include <kplib/foundation/KpInterface.h>

#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>

#include <memory>

namespace {

[[maybe_unused]] const KpTypeInfo* const registered = KpInterface::getClassTypeId();

}  // namespace

KpInterface::KpInterface(KpInterfaceOwner* owner, KpInterfaceOwner::MemoryPolicy policy) : owner_(owner)
{
    std::unique_ptr<KpInterfaceOwner> made;
    if (!owner_) {
        made = std::make_unique<KpInterfaceOwnerDefaultImpl>();
        owner_ = made.get();
    }
    owner_->registerInterface(this, policy);
    static_cast<void>(made.release());  // from here on it belongs to its handles
}

KpInterface::~KpInterface() = default;

KpTypeInfo* KpInterface::getClassTypeId()
{
    static KpTypeInfo type("KpInterface", nullptr, KpTypedObject::getClassTypeId(), nullptr);
    return &type;
}

const KpTypeInfo* KpInterface::getTypeId() const
{
    return getClassTypeId();
}
