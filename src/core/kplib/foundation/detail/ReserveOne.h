#pragma once

#include <kplib/foundation/KpDArray.h>

namespace kplib::detail {

/// Makes room for one more element, or throws with the array as before. An insertion that can't grow the storage leaves
/// the array good for destruction only, which is not for lists that live on.
template <typename T>
void reserveOne(KpDArray<T>& array)
{
    array.resize(array.size() + 1);
    array.resize(array.size() - 1);
}

}  // namespace kplib::detail
