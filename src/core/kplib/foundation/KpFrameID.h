#pragma once

#include <kplib/foundation/KpInt64ID.h>

/// Names a frame. Empty: 0.
class KpFrameID : public KpInt64ID<KpFrameID, 0> {
public:
    using KpInt64ID::KpInt64ID;
};
