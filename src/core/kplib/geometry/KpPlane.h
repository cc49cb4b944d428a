#pragma once

#include <kplib/foundation/KpExport.h>
#include <kplib/geometry/KpVec3f.h>

class KPLIB_API KpPlane {
public:
    const KpVec3f& normal() const { return normal_; }
    float distance() const { return distance_; }

private:
    KpVec3f normal_;
    float distance_;
};
