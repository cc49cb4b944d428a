#pragma once

#include <kplib/cpu/ByteCount.h>
#include <kplib/volume/KpConnectedComponents.h>

#include <cstdint>
#include <type_traits>

namespace kplib::detail {

using Component = KpConnectedComponents::Component;
using ComponentTable = KpDArray<Component>;

// KpConnectedComponents::addNewComponent() and cleanup_components() for images of more voxels than an int counts.
template <typename L>
int addComponent(ComponentTable& components, L* labels, long nLabelled);
template <typename L>
int cleanUpComponents(ComponentTable& components, L* labels, long nLabelled, int minVoxels, int minSeeds);

// Zeroes the counters and removes all entries but the background from the table.
void startComponents(ComponentTable& components);

// The voxels of an image, at most LONG_MAX, for which no memory suffices; 0 if a size is below 1.
inline long nVoxelsOf(const int* dims)
{
    return dims[0] < 1 || dims[1] < 1 || dims[2] < 1 ? 0 : byteCount({dims[0], dims[1], dims[2]});
}

// The value of a region as its seeds: integers modulo 2^32; real numbers cut off to 64 bits before, and 0 outside.
template <typename T>
unsigned seedsOf(T value)
{
    if constexpr (std::is_floating_point_v<T>) {
        constexpr T limit = 9223372036854775808.0;
        return value >= -limit && value < limit ? static_cast<unsigned>(static_cast<std::int64_t>(value)) : 0;
    } else {
        return static_cast<unsigned>(value);
    }
}

}  // namespace kplib::detail
