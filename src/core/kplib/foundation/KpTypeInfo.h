#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpForward.h>

/// The identity of a class at run time: its name, up to two parents and perhaps a factory.
///
/// There is one object for each class, a static in its getClassTypeId(), and a process-wide
/// registry that finds it by name. Types are registered during static initialisation or while a
/// shared object is loaded: the registry has no lock.
class KPLIB_API KpTypeInfo {
public:
    /// Makes an object of the class on the heap.
    using Factory = KpTypedObject* (*)();

    /// A search key, which is not registered. The name is not copied, here and below.
    explicit KpTypeInfo(const char* name);
    /// A type, which is registered after those of an equal name. `create`, the factory, and the
    /// parents may be null.
    KpTypeInfo(const char* name, Factory create, const KpTypeInfo* parent1, const KpTypeInfo* parent2);
    KpTypeInfo(const KpTypeInfo&) = delete;
    KpTypeInfo& operator=(const KpTypeInfo&) = delete;
    /// Removes this object from the registry if it is registered.
    ~KpTypeInfo();

    /// The name of the class.
    const char* name() const { return name_; }
    /// The factory or null.
    Factory factory() const { return factory_; }
    /// @{
    /// A parent or null.
    const KpTypeInfo* parent1() const { return parent1_; }
    const KpTypeInfo* parent2() const { return parent2_; }
    /// @}

    /// Whether this is `other` or has it among its ancestors. Names are not compared.
    bool isOfType(const KpTypeInfo* other) const;

    /// The registered type of that name, the last of several, or null. O(log n).
    static KpTypeInfo* fromName(const char* name);

    /// Removes the type that fromName() finds from the registry; the object stays.
    static void removeType(const char* name);

    /// The registry, sorted by name in the order of strcmp.
    static KpDArray<KpTypeInfo*>& allTypes();

private:
    const char* name_;
    Factory factory_ = nullptr;
    const KpTypeInfo* parent1_ = nullptr;
    const KpTypeInfo* parent2_ = nullptr;
};
