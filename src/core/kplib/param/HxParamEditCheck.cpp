#include <kplib/param/HxParamEditCheck.h>

#include <kplib/param/HxParamBundle.h>
#include <kplib/param/HxParameter.h>

#include <new>

namespace {

bool allows(const HxParamBase* node, HxParamBase::Flag flag)
{
    return (node->flags() & flag) == 0;
}

}  // namespace

HxParamEditCheck::~HxParamEditCheck() = default;

bool HxParamEditCheck::checkRename(HxParamBase* node, const char* /*newName*/)
{
    return allows(node, HxParamBase::FlagNoRename);
}

bool HxParamEditCheck::checkDelete(HxParamBase* node)
{
    return allows(node, HxParamBase::FlagNoDelete);
}

bool HxParamEditCheck::checkInsertBundle(HxParamBundle* into, const char* /*name*/)
{
    return allows(into, HxParamBase::FlagNoInsertBundle);
}

bool HxParamEditCheck::checkInsertParam(HxParamBundle* into, const char* /*name*/)
{
    return allows(into, HxParamBase::FlagNoInsertParam);
}

bool HxParamEditCheck::checkSetValue(HxParameter* node, const char* /*newValue*/)
{
    return allows(node, HxParamBase::FlagNoSetValue);
}

HxParamEditCheck* HxParamEditCheck::defaultEditCheck()
{
    alignas(HxParamEditCheck) static unsigned char storage[sizeof(HxParamEditCheck)];
    static HxParamEditCheck* editCheck = nullptr;
    if (!editCheck)
        editCheck = new (storage) HxParamEditCheck;
    return editCheck;
}
