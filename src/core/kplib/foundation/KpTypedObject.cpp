#include <kplib/foundation/KpTypedObject.h>

const KpTypeInfo* KpTypedObject::getTypeId() const
{
    return getClassTypeId();
}

KpTypedObject::~KpTypedObject() = default;

KpTypeInfo* KpTypedObject::getClassTypeId()
{
    static KpTypeInfo type("KpTypedObject", nullptr, nullptr, nullptr);
    return &type;
}

namespace {

[[maybe_unused]] const KpTypeInfo* const registered = KpTypedObject::getClassTypeId();

}  // namespace
