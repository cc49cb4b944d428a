#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace kplib::detail {

// A value that stands unaligned in a row.
template <typename T>
T readAt(const char* place)
{
    T value;
    std::memcpy(&value, place, sizeof value);
    return value;
}

template <typename T>
void writeAt(char* place, const T& value)
{
    std::memcpy(place, &value, sizeof value);
}

// The distance of two blocks that are no parts of one array.
inline std::intptr_t distance(const void* from, const void* to)
{
    return reinterpret_cast<std::intptr_t>(to) - reinterpret_cast<std::intptr_t>(from);
}

// The place that follows a pointer's target by `bytes`; null stays null.
template <typename T>
T* shifted(T* pointer, std::intptr_t bytes)
{
    // By way of numbers: the two blocks are no parts of one array. (clang-tidy 14 doesn't survive a bit_cast here.)
    // NOLINTNEXTLINE(performance-no-int-to-ptr)
    return pointer ? reinterpret_cast<T*>(reinterpret_cast<std::intptr_t>(pointer) + bytes) : nullptr;
}

// The two words at the head of a row.
constexpr std::uint32_t rowInUse = 0, rowFree = 1;
constexpr int tableIdOffset = 4, rowHeadSize = 8;

}  // namespace kplib::detail
