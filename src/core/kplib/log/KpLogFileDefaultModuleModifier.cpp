#include <kplib/log/KpLogFileDefaultModuleModifier.h>

#include <kplib/foundation/KpString.h>
#include <kplib/log/KpLogFile.h>

KpLogFileDefaultModuleModifier::KpLogFileDefaultModuleModifier() :
    saved_(new KpString(getTheLogInstance().defaultModule()))
{
}

// Delegates to the other constructor, so that the destructor runs if there is no memory for the
// new module.
KpLogFileDefaultModuleModifier::KpLogFileDefaultModuleModifier(const char* module) : KpLogFileDefaultModuleModifier()
{
    getTheLogInstance().setDefaultModule(module);
}

KpLogFileDefaultModuleModifier::~KpLogFileDefaultModuleModifier()
{
    getTheLogInstance().setDefaultModule(*saved_);
    delete saved_;
}
