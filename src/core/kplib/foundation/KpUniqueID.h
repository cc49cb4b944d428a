#pragma once

#include <kplib/foundation/KpInt64ID.h>

#include <climits>

/// A number that no other object of client or server has. Empty: the smallest 64-bit value.
class KpUniqueID : public KpInt64ID<KpUniqueID, LLONG_MIN> {
public:
    using KpInt64ID::KpInt64ID;
};
