#pragma once

#include <kplib/foundation/KpInterfaceOwner.h>

/// An owner that lives by its handles and takes its owned interfaces with it.
class KPLIB_API KpInterfaceOwnerDefaultImpl : public KpInterfaceOwner, public KpHandable {
public:
    const KpTypeInfo* getTypeId() const override;
    ~KpInterfaceOwnerDefaultImpl() override;

    void ref() override;
    void unref() override;
    void notifyDelete() override;
};
