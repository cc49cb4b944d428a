#include <kplib/foundation/KpInterfaceOwnerDefaultImpl.h>

const KpTypeInfo* KpInterfaceOwnerDefaultImpl::getTypeId() const
{
    return getClassTypeId();
}

KpInterfaceOwnerDefaultImpl::~KpInterfaceOwnerDefaultImpl() = default;

void KpInterfaceOwnerDefaultImpl::ref()
{
    KpHandable::ref();
}

void KpInterfaceOwnerDefaultImpl::unref()
{
    KpHandable::unref();
}

void KpInterfaceOwnerDefaultImpl::notifyDelete()
{
    KpInterfaceOwner::notifyDelete();
}
