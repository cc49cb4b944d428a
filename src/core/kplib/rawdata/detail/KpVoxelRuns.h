#pragma once

#include <kplib/rawdata/TmDataAccess.h>

namespace kplib::detail {

/// Calls `run(address, bytes)` for the voxels of `object` from the first to the last, in blocks as large as the layout
/// allows; not at all if there are none.
template <typename Run>
void eachVoxelRun(const TmDataAccess& object, Run run)
{
    if (!object.hasData() || object.size() <= 0)
        return;
    const KpVec3l dims = object.dims(), strides = object.strides();
    if (object.isContiguous()) {
        run(object.dataPtr(0), static_cast<unsigned long>(object.size()));
        return;
    }
    const auto rowBytes = object.primType().size() * dims[0] * object.nDataVar();
    const bool isPacked = strides[1] == rowBytes;
    const long rows = isPacked ? 1 : dims[1];
    const long runBytes = isPacked ? rowBytes * dims[1] : rowBytes;
    for (long z = 0; z < dims[2]; ++z)
        for (long y = 0; y < rows; ++y)
            run(object.dataPtr(0, y, z), static_cast<unsigned long>(runBytes));
}

}  // namespace kplib::detail
