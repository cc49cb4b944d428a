#pragma once

#include <kplib/foundation/KpInt64ID.h>

/// Names a transfer of data between client and server. Empty: -1.
class KpTransferID : public KpInt64ID<KpTransferID, -1> {
public:
    using KpInt64ID::KpInt64ID;
};
