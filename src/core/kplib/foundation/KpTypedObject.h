#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/foundation/KpTypeInfo.h>

/// Base of objects with a run-time type.
///
/// A typed class has its own getClassTypeId() with a static KpTypeInfo that names the class and its parent, a
/// getTypeId() that returns it, and an initClass(); a static initialiser in its source calls getClassTypeId(), so that
/// the class is registered before main().
class KPLIB_API KpTypedObject {
public:
    /// The type of this object's class.
    virtual const KpTypeInfo* getTypeId() const;
    virtual ~KpTypedObject();

    /// The registered type of the class.
    static KpTypeInfo* getClassTypeId();

    /// Registers the class if it is not registered yet.
    static void initClass() { getClassTypeId(); }
};
