#include <kplib/foundation/KpTypeInfo.h>

#include <kplib/foundation/KpDArray.h>

#include <cstring>

namespace {

int compareNames(KpTypeInfo* const& a, KpTypeInfo* const& b)
{
    return std::strcmp(a->name(), b->name());
}

// Index of the last type of that name, or -1.
long indexOf(const char* name)
{
    const KpDArray<KpTypeInfo*>& types = KpTypeInfo::allTypes();
    long lo = -1, hi = types.size();
    while (hi - lo >= 2) {
        const long mid = (lo + hi) / 2;
        if (std::strcmp(name, types[mid]->name()) < 0)
            hi = mid;
        else
            lo = mid;
    }
    return lo >= 0 && std::strcmp(name, types[lo]->name()) == 0 ? lo : -1;
}

}  // namespace

KpTypeInfo::KpTypeInfo(const char* name) : name_(name) {}

KpTypeInfo::KpTypeInfo(const char* name, Factory create, const KpTypeInfo* parent1, const KpTypeInfo* parent2) :
    name_(name), factory_(create), parent1_(parent1), parent2_(parent2)
{
    // The registry is constructed before this object, so it outlives a static object.
    allTypes().reserveOne();
    allTypes().insertSorted(this, compareNames);
}

KpTypeInfo::~KpTypeInfo()
{
    KpDArray<KpTypeInfo*>& types = allTypes();
    for (long i = 0; i < types.size(); ++i) {
        if (types[i] == this) {
            types.remove(i);
            return;
        }
    }
}

bool KpTypeInfo::isOfType(const KpTypeInfo* other) const
{
    return this == other || (parent1_ && parent1_->isOfType(other)) || (parent2_ && parent2_->isOfType(other));
}

KpTypeInfo* KpTypeInfo::fromName(const char* name)
{
    const long index = indexOf(name);
    return index < 0 ? nullptr : allTypes()[index];
}

void KpTypeInfo::removeType(const char* name)
{
    if (const long index = indexOf(name); index >= 0)
        allTypes().remove(index);
}

KpDArray<KpTypeInfo*>& KpTypeInfo::allTypes()
{
    static KpDArray<KpTypeInfo*> types;
    return types;
}
