#pragma once

#include <kplib/foundation/KpID.h>

/// Names the context of a session. Empty: -1.
class TmSessionContextID : public KpID<int, -1> {
public:
    /// With the constructors of KpID.
    using KpID::KpID;
};
